// The renderer's own logic (values, effect parsing, options, PNG files) on
// hand-made inputs, and the request it makes of the library.

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <string>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

#include <nlohmann/json.hpp>

#include "Effects.h"
#include "Options.h"
#include "Png.h"
#include "Renderer.h"
#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

// The message of the UsageError `f` throws ("" when none is thrown).
template <typename F>
std::string UsageMessage(F&& f) {
    try {
        f();
    } catch (const UsageError& e) {
        return e.what();
    }
    return "";
}

// --- values

TEST(RenderValuesTest, ColoursInEveryWrittenForm) {
    EXPECT_EQ(ParseColor("#FF0000", "c"), 0xFFFF0000u);
    EXPECT_EQ(ParseColor("#80ff0000", "c"), 0x80FF0000u);   // alpha first
    EXPECT_EQ(ParseColor("#1a3", "c"), 0xFF11AA33u);
    EXPECT_EQ(ParseColor("0x12345678", "c"), 0x12345678u);
    EXPECT_EQ(ParseColor(" White ", "c"), 0xFFFFFFFFu);
    EXPECT_EQ(ParseColor("transparent", "c"), 0u);
    for (const char* bad : {"#12345", "#GG0000", "red0", "", "#", "0x"}) {
        EXPECT_NE(UsageMessage([&] { ParseColor(bad, "stroke color"); }).find("stroke color"), std::string::npos)
            << bad;
    }
    EXPECT_EQ(FormatColor(0xFF00FF00u), "#00FF00");
    EXPECT_EQ(FormatColor(0x8000FF00u), "#8000FF00");
}

TEST(RenderValuesTest, NumbersMustBeWholeAndFinite) {
    EXPECT_EQ(ParseNumber("-2.5", "n"), -2.5f);
    EXPECT_EQ(ParseNumber("+3", "n"), 3.0f);
    EXPECT_EQ(ParseInteger("42", "n"), 42);
    for (const char* bad : {"1.5px", "nan", "inf", "", "1e99", "--1"}) {
        EXPECT_FALSE(UsageMessage([&] { ParseNumber(bad, "n"); }).empty()) << bad;
    }
    EXPECT_FALSE(UsageMessage([] { ParseInteger("2.5", "n"); }).empty());
    EXPECT_TRUE(ParseBoolean("on", "b"));
    EXPECT_FALSE(ParseBoolean("false", "b"));
    EXPECT_FALSE(UsageMessage([] { ParseBoolean("maybe", "b"); }).empty());
}

TEST(RenderValuesTest, StopsSpreadEvenlyAndKeepTheirAlphaAndOpacity) {
    const std::vector<glimmer::ColorStop> even = ParseStops("#FF0000/#00FF00 #800000FF", "s");
    ASSERT_EQ(even.size(), 3u);
    EXPECT_EQ(even[0].position, 0.0f);
    EXPECT_EQ(even[1].position, 0.5f);
    EXPECT_EQ(even[2].position, 1.0f);
    EXPECT_EQ(even[0].opacity, 1.0f);
    EXPECT_EQ(even[2].color, 0x800000FFu);

    const std::vector<glimmer::ColorStop> given = ParseStops("red@0.25@0.5/blue@0.75", "s");
    ASSERT_EQ(given.size(), 2u);
    EXPECT_EQ(given[0].position, 0.25f);
    EXPECT_EQ(given[0].opacity, 0.5f);
    EXPECT_EQ(given[1].color, 0xFF0000FFu);

    EXPECT_NE(UsageMessage([] { ParseStops("red@0/blue", "s"); }).find("every stop or to none"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseStops("red@0.6/blue@0.2", "s"); }).find("must not decrease"), std::string::npos);
    EXPECT_FALSE(UsageMessage([] { ParseStops("red@1.5", "s"); }).empty());
    EXPECT_FALSE(UsageMessage([] { ParseStops("red@0@1@2", "s"); }).empty());
}

// --- effects and options

TEST(RenderEffectsTest, ParsingFillsDefaultsAndNamesWhatIsWrong) {
    const EffectRequest stroke = ParseEffect("outline:size=6,colour=#00FF00,position=center");
    EXPECT_STREQ(stroke.spec->name, "stroke");
    EXPECT_EQ(stroke.Get("size").number, 6.0f);
    EXPECT_EQ(stroke.Get("color").color, 0xFF00FF00u);
    EXPECT_EQ(stroke.Get("position").choice, 0);
    EXPECT_EQ(stroke.Get("opacity").number, 1.0f);   // default

    const EffectRequest shadow = ParseEffect("shadow");
    EXPECT_EQ(shadow.Get("angle").number, 120.0f);

    const std::string unknownEffect = UsageMessage([] { ParseEffect("sparkle:size=3"); });
    EXPECT_NE(unknownEffect.find("'sparkle'"), std::string::npos);
    EXPECT_NE(unknownEffect.find("outer-shadow"), std::string::npos);   // lists the valid ones
    const std::string unknownParam = UsageMessage([] { ParseEffect("stroke:width=3"); });
    EXPECT_NE(unknownParam.find("'width'"), std::string::npos);
    EXPECT_NE(unknownParam.find("size, color, opacity, position"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseEffect("stroke:position=middle"); }).find("outside"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseEffect("stroke:size"); }).find("name=value"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseEffect("pattern:scale=2"); }).find("tile=FILE"), std::string::npos);
}

TEST(RenderEffectsTest, JsonEffectsTakeNumbersStringsAndStopObjects) {
    const nlohmann::json glow = nlohmann::json::parse(
        R"({"type": "outer-glow", "size": 12, "stops": ["#FF0000@0", {"color": "#0000FF", "position": 1, "opacity": 0.5}]})");
    const EffectRequest parsed = ParseEffect(glow, "");
    EXPECT_EQ(parsed.Get("size").number, 12.0f);
    ASSERT_EQ(parsed.Get("stops").stops.size(), 2u);
    EXPECT_EQ(parsed.Get("stops").stops[1].opacity, 0.5f);

    const nlohmann::json tile = nlohmann::json::parse(R"({"type": "pattern", "tile": "t.png"})");
    EXPECT_EQ(ParseEffect(tile, "/data").Get("tile").path, "/data/t.png");
    EXPECT_FALSE(UsageMessage([] { ParseEffect(nlohmann::json::parse(R"({"size": 3})"), ""); }).empty());
    EXPECT_FALSE(UsageMessage([] { ParseEffect(nlohmann::json::parse(R"({"type": "stroke", "size": [3]})"), ""); }).empty());
}

TEST(RenderOptionsTest, CommandLineFillsTheRequest) {
    const Command c = ParseCommandLine({"Hi\\nthere", "--size=40", "-e", "stroke", "--padding", "1,2,3,4",
                                        "--gravity", "bottom", "--align", "right", "--italic", "-o", "x.png"});
    EXPECT_EQ(c.request.text, "Hi\nthere");
    EXPECT_EQ(c.request.size, 40.0f);
    ASSERT_EQ(c.request.effects.size(), 1u);
    EXPECT_EQ(c.request.padding[3], 4);
    EXPECT_EQ(c.request.gravity, Gravity::kBottom);
    EXPECT_EQ(c.request.align, Align::kRight);
    EXPECT_TRUE(c.request.italic);
    EXPECT_EQ(c.output, "x.png");

    EXPECT_NE(UsageMessage([] { ParseCommandLine({"--bogus"}); }).find("--bogus"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseCommandLine({"--size"}); }).find("needs a value"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseCommandLine({"a", "b"}); }).find("'b'"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseCommandLine({"--italic=yes"}); }).find("takes no value"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseCommandLine({"--padding", "1,2"}); }).find("four"), std::string::npos);
}

TEST(RenderOptionsTest, HelpListsEveryEffectAndParameter) {
    const std::string help = HelpText();
    for (const EffectSpec& spec : EffectCatalog()) {
        EXPECT_NE(help.find(std::string("  ") + spec.name), std::string::npos) << spec.name;
        for (const ParamSpec& p : spec.params) {
            EXPECT_NE(help.find(std::string(p.name) + "="), std::string::npos) << spec.name << " " << p.name;
        }
    }
}

// --- the request made of the library

// Each catalogue entry with every parameter at its default becomes the
// library's effect with its own defaults: the help text tells the truth.
TEST(RenderRequestTest, CatalogueDefaultsAreTheLibrarysDefaults) {
    auto made = [](const std::string& spec) {
        glimmer::Text text;
        EffectRequest effect = ParseEffect(spec);
        for (ParamValue& v : effect.values) {
            if (v.path == "(memory)") v.image = Image(1, 1, 0xFF00FF00u);
        }
        AddEffect(effect, &text);
        return text;
    };
    // Byte for byte: these types hold only 4-byte numbers and enums, no padding.
    auto same = [](const auto& a, const auto& b) { return std::memcmp(&a, &b, sizeof a) == 0; };
    const auto first = [&](const std::string& spec) { return made(spec).effects.at(0); };
    EXPECT_TRUE(same(std::get<glimmer::OuterShadow>(first("outer-shadow")), glimmer::OuterShadow{}));
    EXPECT_TRUE(same(std::get<glimmer::InnerShadow>(first("inner-shadow")), glimmer::InnerShadow{}));
    EXPECT_TRUE(same(std::get<glimmer::Stroke>(first("stroke")), glimmer::Stroke{}));
    for (const char* glow : {"outer-glow", "inner-glow"}) {
        const glimmer::OuterGlow expected;
        const glimmer::Effect e = first(glow);
        const auto check = [&](const auto& g) {
            EXPECT_EQ(g.size, expected.size);
            EXPECT_EQ(g.color, expected.color);
            EXPECT_EQ(g.opacity, expected.opacity);
            EXPECT_TRUE(g.stops.empty());
        };
        if (e.index() == 2) check(std::get<glimmer::OuterGlow>(e));
        else check(std::get<glimmer::InnerGlow>(e));
    }
    const auto stopsEqual = [](const std::vector<glimmer::ColorStop>& a, const std::vector<glimmer::ColorStop>& b) {
        if (a.size() != b.size()) return false;
        for (size_t i = 0; i < a.size(); ++i) {
            if (a[i].color != b[i].color || a[i].position != b[i].position || a[i].opacity != b[i].opacity) return false;
        }
        return true;
    };
    const auto linear = std::get<glimmer::LinearGradient>(first("linear-gradient"));
    EXPECT_EQ(linear.angle, glimmer::LinearGradient{}.angle);
    EXPECT_EQ(linear.scale, glimmer::LinearGradient{}.scale);
    EXPECT_TRUE(stopsEqual(linear.stops, glimmer::LinearGradient{}.stops));
    const auto radial = std::get<glimmer::RadialGradient>(first("radial-gradient"));
    EXPECT_EQ(radial.scale, glimmer::RadialGradient{}.scale);
    EXPECT_TRUE(stopsEqual(radial.stops, glimmer::RadialGradient{}.stops));
    const auto pattern = std::get<glimmer::Pattern>(first("pattern:tile=(memory)"));
    EXPECT_EQ(pattern.scale, glimmer::Pattern{}.scale);
    EXPECT_EQ(pattern.opacity, glimmer::Pattern{}.opacity);
    EXPECT_TRUE(same(std::get<glimmer::Bevel>(first("bevel")), glimmer::Bevel{}));
    EXPECT_TRUE(same(std::get<glimmer::Emboss>(first("emboss")), glimmer::Emboss{}));
    const glimmer::Text fill = made("text");
    EXPECT_TRUE(fill.effects.empty());
    EXPECT_EQ(fill.style.color, glimmer::TextStyle{}.color);
    EXPECT_EQ(fill.style.fillOpacity, glimmer::TextStyle{}.fillOpacity);
}

// The bevel's choices and the stroke's positions reach the library by name.
TEST(RenderRequestTest, ChoicesMapOntoTheLibrarysEnums) {
    glimmer::Text text;
    AddEffect(ParseEffect("bevel:style=outer,direction=down,technique=hard,soften=3"), &text);
    AddEffect(ParseEffect("emboss:style=two-sided"), &text);
    AddEffect(ParseEffect("stroke:position=centre"), &text);
    AddEffect(ParseEffect("text:color=#80102030,opacity=0.25"), &text);
    const auto& bevel = std::get<glimmer::Bevel>(text.effects.at(0));
    EXPECT_EQ(bevel.style, glimmer::BevelStyle::kOuter);
    EXPECT_EQ(bevel.direction, glimmer::ReliefDirection::kDown);
    EXPECT_EQ(bevel.technique, glimmer::ReliefTechnique::kHard);
    EXPECT_EQ(bevel.soften, 3);
    EXPECT_EQ(std::get<glimmer::Emboss>(text.effects.at(1)).style, glimmer::EmbossStyle::kTwoSided);
    EXPECT_EQ(std::get<glimmer::Stroke>(text.effects.at(2)).position, glimmer::StrokePosition::kCenter);
    EXPECT_EQ(text.style.color, 0x80102030u);
    EXPECT_EQ(text.style.fillOpacity, 0.25f);
}

RenderRequest Sample(const char* text = "Ag") {
    RenderRequest request;
    request.text = text;
    request.size = 40.0f;
    return request;
}

// Every effect kind and both stackings render in the picture table; here the
// failures keep their exit status.
TEST(RenderRequestTest, FailuresKeepTheirExitStatus) {
    RenderRequest request = Sample();
    request.width = 32000;
    request.height = 32000;
    EXPECT_THROW(Render(request), RenderError);
    request = Sample();
    request.text = "";
    EXPECT_THROW(Render(request), UsageError);
    request = Sample();
    request.text = "\xC3\x28";
    EXPECT_THROW(Render(request), UsageError);
    request = Sample();
    request.firstLine = 1;
    EXPECT_THROW(Render(request), UsageError);
    request = Sample();
    request.fontPath = "/no/such/font.ttf";
    EXPECT_THROW(Render(request), RenderError);
}

// --- PNG files

TEST(RenderPngTest, WritesThroughATemporaryFileAndReadsBack) {
    char folder[] = "/tmp/glimmer-render-test-XXXXXX";
    ASSERT_NE(mkdtemp(folder), nullptr);
    const std::string path = std::string(folder) + "/out.png";
    Image image(3, 2);
    image.pixels = {0xFF102030u, 0x80FF0000u, 0x00000000u, 0xFFFFFFFFu, 0x01020304u, 0xFE00FF00u};
    WritePng(path, image);
    EXPECT_NE(access(path.c_str(), F_OK), -1);
    EXPECT_EQ(access((path + ".tmp").c_str(), F_OK), -1);
    const Image back = ReadPng(path, "t", 16);
    EXPECT_EQ(back.width, 3);
    EXPECT_EQ(back.pixels, image.pixels);
    EXPECT_THROW(ReadPng(path, "t", 2), RenderError);   // larger than allowed

    // A folder as the target: nothing is left behind.
    EXPECT_THROW(WritePng(folder, image), RenderError);
    EXPECT_EQ(access((std::string(folder) + ".tmp").c_str(), F_OK), -1);
    EXPECT_THROW(WritePng(std::string(folder) + "/missing/out.png", image), RenderError);
    std::remove(path.c_str());
    rmdir(folder);
}

TEST(RenderPngTest, JsonAndTilesOnlyFromRegularFilesAndRefusedAtOnce) {
    // A pipe without a writer would block an open, a device never ends: both
    // are refused before anything is read.
    char folder[] = "/tmp/glimmer-render-test-XXXXXX";
    ASSERT_NE(mkdtemp(folder), nullptr);
    const std::string pipe = std::string(folder) + "/pipe";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    for (const std::string& path : {pipe, std::string("/dev/zero"), std::string(folder)}) {
        Command command;
        EXPECT_THROW(ReadJsonFile(path, &command), RenderError) << path;
        EXPECT_THROW(ReadPng(path, "pattern tile", 16), RenderError) << path;
    }
    std::remove(pipe.c_str());
    rmdir(folder);
}

}  // namespace
}  // namespace Glimmer::RenderTool

// fontconfig 2.14 loses a few hundred bytes inside FcInit, once per process.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
