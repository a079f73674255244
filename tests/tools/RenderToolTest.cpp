// The renderer's own logic (values, effect parsing, options, PNG files) on
// hand-made inputs, and the request it makes of the library. Its pictures are
// pinned by the picture table, its exit statuses and messages by the smoke runs.

#include <gtest/gtest.h>

#include <cstdio>
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

TEST(RenderValuesTest, ColoursNumbersAndStopsInEveryWrittenForm) {
    const std::pair<const char*, uint32_t> colours[] = {
        {"#FF0000", 0xFFFF0000u}, {"#80ff0000", 0x80FF0000u},   // alpha first
        {"#1a3", 0xFF11AA33u},    {"0x12345678", 0x12345678u}, {" White ", 0xFFFFFFFFu}, {"transparent", 0u}};
    for (const auto& [text, colour] : colours) EXPECT_EQ(ParseColor(text, "c"), colour) << text;
    for (const char* bad : {"#12345", "#GG0000", "red0", "", "#", "0x"}) {
        EXPECT_NE(UsageMessage([&] { ParseColor(bad, "stroke color"); }).find("stroke color"), std::string::npos)
            << bad;
    }
    EXPECT_EQ(ParseNumber("+3", "n"), 3.0f);
    for (const char* bad : {"1.5px", "nan", "inf", "", "1e99", "--1"}) {
        EXPECT_FALSE(UsageMessage([&] { ParseNumber(bad, "n"); }).empty()) << bad;
    }
    EXPECT_FALSE(UsageMessage([] { ParseInteger("2.5", "n"); }).empty());
    EXPECT_FALSE(UsageMessage([] { ParseBoolean("maybe", "b"); }).empty());

    const std::vector<glimmer::ColorStop> even = ParseStops("#FF0000/#00FF00 #800000FF", "s");
    ASSERT_EQ(even.size(), 3u);
    EXPECT_EQ(even[1].position, 0.5f);
    EXPECT_EQ(even[2].color, 0x800000FFu);
    const std::vector<glimmer::ColorStop> given = ParseStops("red@0.25@0.5/blue@0.75", "s");
    ASSERT_EQ(given.size(), 2u);
    EXPECT_EQ(given[0].position, 0.25f);
    EXPECT_EQ(given[0].opacity, 0.5f);
    EXPECT_NE(UsageMessage([] { ParseStops("red@0/blue", "s"); }).find("every stop or to none"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseStops("red@0.6/blue@0.2", "s"); }).find("must not decrease"), std::string::npos);
    EXPECT_FALSE(UsageMessage([] { ParseStops("red@1.5", "s"); }).empty());
}

// --- effects and options

TEST(RenderEffectsTest, ParsingFillsDefaultsAndNamesWhatIsWrong) {
    const EffectRequest stroke = ParseEffect("outline:size=6,colour=#00FF00,position=center");
    EXPECT_STREQ(stroke.spec->name, "stroke");
    EXPECT_EQ(stroke.Get("color").color, 0xFF00FF00u);
    EXPECT_EQ(stroke.Get("opacity").number, 1.0f);   // default
    const nlohmann::json glow = nlohmann::json::parse(
        R"({"type": "outer-glow", "stops": ["#FF0000@0", {"color": "#0000FF", "position": 1, "opacity": 0.5}]})");
    EXPECT_EQ(ParseEffect(glow, "").Get("stops").stops.at(1).opacity, 0.5f);
    const nlohmann::json tile = nlohmann::json::parse(R"({"type": "pattern", "tile": "t.png"})");
    EXPECT_EQ(ParseEffect(tile, "/data").Get("tile").path, "/data/t.png");

    const std::pair<const char*, const char*> bad[] = {
        {"sparkle:size=3", "outer-shadow"},   // lists the valid ones
        {"stroke:width=3", "'width' (valid: size, color, opacity, position)"},
        {"stroke:position=middle", "outside"},
        {"stroke:size", "name=value"},
        {"pattern:scale=2", "tile=FILE"},
    };
    for (const auto& [spec, says] : bad) {
        const std::string message = UsageMessage([&] { ParseEffect(spec); });
        EXPECT_NE(message.find(says), std::string::npos) << spec << ": " << message;
    }
    EXPECT_FALSE(UsageMessage([] { ParseEffect(nlohmann::json::parse(R"({"size": 3})"), ""); }).empty());
    EXPECT_FALSE(UsageMessage([] { ParseEffect(nlohmann::json::parse(R"({"type": "stroke", "size": [3]})"), ""); }).empty());
}

TEST(RenderOptionsTest, CommandLineFillsTheRequestAndHelpListsEveryParameter) {
    const Command c = ParseCommandLine({"Hi\\nthere", "--size=40", "-e", "stroke", "--padding", "1,2,3,4",
                                        "--gravity", "bottom", "--align", "right", "--italic", "-o", "x.png"});
    EXPECT_EQ(c.request.text, "Hi\nthere");
    EXPECT_EQ(c.request.size, 40.0f);
    EXPECT_EQ(c.request.effects.size(), 1u);
    EXPECT_EQ(c.request.padding[3], 4);
    EXPECT_EQ(c.request.gravity, Gravity::kBottom);
    EXPECT_EQ(c.request.align, Align::kRight);
    EXPECT_TRUE(c.request.italic);
    EXPECT_EQ(c.output, "x.png");
    const std::pair<std::vector<std::string>, const char*> bad[] = {
        {{"--bogus"}, "--bogus"},           {{"--size"}, "needs a value"},          {{"a", "b"}, "'b'"},
        {{"--italic=yes"}, "takes no value"}, {{"--padding", "1,2"}, "four"},
    };
    for (const auto& [args, says] : bad) EXPECT_NE(UsageMessage([&] { ParseCommandLine(args); }).find(says), std::string::npos) << says;

    const std::string help = HelpText();
    for (const EffectSpec& spec : EffectCatalog()) {
        EXPECT_NE(help.find(std::string("  ") + spec.name), std::string::npos) << spec.name;
        for (const ParamSpec& p : spec.params) {
            EXPECT_NE(help.find(std::string(p.name) + "="), std::string::npos) << spec.name << " " << p.name;
        }
    }
}

// --- files

TEST(RenderFilesTest, ImagesAndRequestsAreReadOnlyFromRegularFilesOfBoundedSize) {
    char folder[] = "/tmp/glimmer-render-test-XXXXXX";
    ASSERT_NE(mkdtemp(folder), nullptr);
    const std::string png = std::string(folder) + "/out.png", pipe = std::string(folder) + "/pipe";
    Image image(3, 2);
    image.pixels = {0xFF102030u, 0x80FF0000u, 0x00000000u, 0xFFFFFFFFu, 0x01020304u, 0xFE00FF00u};
    WritePng(png, image);   // through a temporary file
    EXPECT_EQ(access((png + ".tmp").c_str(), F_OK), -1);
    EXPECT_EQ(ReadPng(png, "t", 16).pixels, image.pixels);
    EXPECT_THROW(ReadPng(png, "t", 2), RenderError);   // larger than allowed
    // A pipe without a writer would block an open, a device never ends: both
    // are refused before anything is read.
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    for (const std::string& source : {pipe, std::string("/dev/zero"), std::string(folder)}) {
        Command command;
        EXPECT_THROW(ReadJsonFile(source, &command), RenderError) << source;
        EXPECT_THROW(ReadPng(source, "pattern tile", 16), RenderError) << source;
    }
    std::remove(pipe.c_str());
    std::remove(png.c_str());
    rmdir(folder);
}

}  // namespace
}  // namespace Glimmer::RenderTool
