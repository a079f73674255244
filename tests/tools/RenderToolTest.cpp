// The renderer's own logic (values, effect parsing, line layout and the
// layout native's gravity rules) on hand-made inputs, and whole renders
// checked by properties of their pixels.

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <string>
#include <unistd.h>
#include <vector>

#include <nlohmann/json.hpp>

#include "Effects.h"
#include "LineLayout.h"
#include "Options.h"
#include "Png.h"
#include "Renderer.h"
#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

uint32_t Alpha(uint32_t c) { return c >> 24; }
uint32_t Red(uint32_t c) { return c >> 16 & 0xFF; }
uint32_t Green(uint32_t c) { return c >> 8 & 0xFF; }
uint32_t Blue(uint32_t c) { return c & 0xFF; }

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

TEST(RenderValuesTest, StopsSpreadEvenlyAndTakeTheirOpacityFromTheAlpha) {
    const std::vector<GxGradient> even = ParseStops("#FF0000/#00FF00 #800000FF", "s");
    ASSERT_EQ(even.size(), 3u);
    EXPECT_EQ(even[0].position, 0.0f);
    EXPECT_EQ(even[1].position, 0.5f);
    EXPECT_EQ(even[2].position, 1.0f);
    EXPECT_EQ(even[0].opacity, 1.0f);
    EXPECT_FLOAT_EQ(even[2].opacity, 128.0f / 255.0f);

    const std::vector<GxGradient> given = ParseStops("red@0.25@0.5/blue@0.75", "s");
    ASSERT_EQ(given.size(), 2u);
    EXPECT_EQ(given[0].position, 0.25f);
    EXPECT_EQ(given[0].opacity, 0.5f);
    EXPECT_EQ(given[1].color, 0xFF0000FFu);

    EXPECT_NE(UsageMessage([] { ParseStops("red@0/blue", "s"); }).find("every stop or to none"), std::string::npos);
    EXPECT_NE(UsageMessage([] { ParseStops("red@0.6/blue@0.2", "s"); }).find("must not decrease"), std::string::npos);
    EXPECT_FALSE(UsageMessage([] { ParseStops("red@1.5", "s"); }).empty());
    EXPECT_FALSE(UsageMessage([] { ParseStops("red@0@1@2", "s"); }).empty());
}

TEST(RenderValuesTest, PrintableKeyShowsEachRecordAsLetterAndHexBytes) {
    const char key[] = {'K', char(0x84), char(0x8F), 'T', char(0x8F), char(0x80), 0};
    EXPECT_EQ(PrintableKey(key), "K848F T8F80");
    EXPECT_EQ(PrintableKey(""), "");
    EXPECT_EQ(PrintableKey(nullptr), "");
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
    EXPECT_EQ(c.request.verticalGravity, 0x50);
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

// --- line layout

// Every UTF-16 unit 10 pixels wide.
float TenEach(size_t start, size_t end) { return 10.0f * float(end - start); }

TEST(RenderLineLayoutTest, WrapsAtBreakOpportunitiesKeepingSpacesOnTheLine) {
    const std::vector<LayoutLine> lines = BreakLines(u"aaa bbb ccc", TenEach, 65.0f);
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0].start, 0);
    EXPECT_EQ(lines[0].end, 4);          // the space stays on the first line
    EXPECT_EQ(lines[0].visibleEnd, 3);   // but is not visible
    EXPECT_EQ(lines[0].width, 30.0f);
    EXPECT_EQ(lines[1].start, 4);
    EXPECT_EQ(lines[2].start, 8);
    EXPECT_EQ(lines[2].visibleEnd, 11);

    // Two words fit in 70 (the trailing space does not count).
    const std::vector<LayoutLine> two = BreakLines(u"aaa bbb ccc", TenEach, 70.0f);
    ASSERT_EQ(two.size(), 2u);
    EXPECT_EQ(two[0].visibleEnd, 7);
    EXPECT_EQ(two[0].width, 70.0f);

    // A hyphen is an opportunity; a split on spaces would miss it.
    const std::vector<LayoutLine> hyphen = BreakLines(u"well-known", TenEach, 60.0f);
    ASSERT_EQ(hyphen.size(), 2u);
    EXPECT_EQ(hyphen[0].visibleEnd, 5);
}

TEST(RenderLineLayoutTest, CutsAWordTooWideBetweenClustersAndSplitsAtNewlines) {
    const std::vector<LayoutLine> cut = BreakLines(u"abcdefg", TenEach, 30.0f);
    ASSERT_EQ(cut.size(), 3u);
    EXPECT_EQ(cut[0].visibleEnd, 3);
    EXPECT_EQ(cut[1].start, 3);
    EXPECT_EQ(cut[2].visibleEnd, 7);

    // e + combining acute is one cluster: never cut between them.
    const std::vector<LayoutLine> cluster = BreakLines(u"ae\u0301bc", TenEach, 20.0f);
    ASSERT_GE(cluster.size(), 2u);
    EXPECT_NE(cluster[0].visibleEnd, 2);

    const std::vector<LayoutLine> paragraphs = BreakLines(u"ab\n\ncd\n", TenEach, 0.0f);
    ASSERT_EQ(paragraphs.size(), 4u);   // "ab", "", "cd", and the empty line after the final break
    EXPECT_EQ(paragraphs[0].end, 3);
    EXPECT_EQ(paragraphs[0].visibleEnd, 2);
    EXPECT_EQ(paragraphs[1].start, 3);
    EXPECT_EQ(paragraphs[1].visibleEnd, 3);
    EXPECT_EQ(paragraphs[2].width, 20.0f);
    EXPECT_EQ(paragraphs[3].start, 7);
    EXPECT_EQ(paragraphs[3].visibleEnd, 7);
}

TEST(RenderLineLayoutTest, PlacesLinesWithFontPaddingAndAlignment) {
    std::vector<LayoutLine> lines = BreakLines(u"aa\nbbbb\ncc", TenEach, 0.0f);
    const FontExtent extent{-12, -10, 3, 5};
    PlaceLines(&lines, extent, true, 45, Align::kCenter);
    // First line from the box top, middle lines ascent to descent, last to the box bottom.
    EXPECT_EQ(lines[0].top, 0);
    EXPECT_EQ(lines[0].baseline, 12);
    EXPECT_EQ(lines[0].bottom, 15);
    EXPECT_EQ(lines[1].baseline, 25);
    EXPECT_EQ(lines[1].bottom, 28);
    EXPECT_EQ(lines[2].baseline, 38);
    EXPECT_EQ(lines[2].bottom, 43);
    EXPECT_EQ(lines[2].descent, 5);
    EXPECT_EQ(lines[0].ascent, -12);
    EXPECT_EQ(lines[0].left, 12.0f);    // floor((45 - 20) / 2)
    EXPECT_EQ(lines[1].left, 2.0f);     // floor(2.5)

    PlaceLines(&lines, extent, false, 45, Align::kRight);
    EXPECT_EQ(lines[0].baseline, 10);
    EXPECT_EQ(lines[2].bottom, 39);
    EXPECT_EQ(lines[1].left, 5.0f);
}

// Five lines 20 pixels apart, baselines at 15, 35, ...
std::vector<LayoutLine> FiveLines() {
    std::vector<LayoutLine> lines(5);
    for (int i = 0; i < 5; ++i) {
        lines[i].start = i * 3;
        lines[i].visibleEnd = i * 3 + 2;
        lines[i].top = 20 * i;
        lines[i].baseline = 20 * i + 15;
        lines[i].bottom = 20 * i + 20;
        lines[i].ascent = -15;
        lines[i].descent = 5;
        lines[i].left = 2.7f;
        lines[i].width = 30.9f;
    }
    return lines;
}

TEST(RenderLineLayoutTest, BottomGravityShowsTheLastLinesOnTheBottomPadding) {
    ViewGeometry view;
    view.width = 100;
    view.height = 200;
    view.paddingLeft = 4;
    view.paddingBottom = 7;
    view.gravity = 0x53;
    view.lineLimit = 2;
    view.maxLines = 5;
    const std::vector<GxLineInfo> records = MakeLineRecords(FiveLines(), view);
    ASSERT_EQ(records.size(), 2u);
    EXPECT_EQ(records[0].start, 9);     // lines 3 and 4
    EXPECT_EQ(records[1].start, 12);
    // Line 4's baseline: view height - bottom padding - (last bottom - its baseline).
    EXPECT_EQ(records[1].baseline, 200 - 7 - (100 - 95));
    EXPECT_EQ(records[0].baseline, records[1].baseline - 20);
    EXPECT_EQ(records[1].end, 14);
    EXPECT_EQ(records[1].x, 4 + 2);     // padding + truncated left
    EXPECT_EQ(records[1].direction, 1);
    EXPECT_EQ(records[1].bounds.left, 6);
    EXPECT_EQ(records[1].bounds.right, 6 + 30);
    EXPECT_EQ(records[1].bounds.top, records[1].baseline - 15);
    EXPECT_EQ(records[1].bounds.bottom, records[1].baseline + 5);
}

TEST(RenderLineLayoutTest, CentreAndTopGravityAndTheLineCount) {
    ViewGeometry view;
    view.width = 100;
    view.height = 100;
    view.paddingTop = 10;
    view.paddingBottom = 20;
    view.gravity = 0x13;
    view.maxLines = 2;
    std::vector<GxLineInfo> records = MakeLineRecords(FiveLines(), view);
    ASSERT_EQ(records.size(), 2u);
    // Available 70, shown bottom 40: the lines move down by 15.
    EXPECT_EQ(records[0].baseline, 10 + 15 + 15);
    EXPECT_EQ(records[1].baseline, 60);

    view.gravity = 0x33;
    records = MakeLineRecords(FiveLines(), view);
    EXPECT_EQ(records[0].baseline, 25);

    view.lineLimit = 3;   // wins over maxLines
    EXPECT_EQ(MakeLineRecords(FiveLines(), view).size(), 3u);
    view.lineLimit = 0;
    view.maxLines = 0;    // neither set: no line at all
    EXPECT_TRUE(MakeLineRecords(FiveLines(), view).empty());
}

// --- whole renders

RenderRequest Sample(const char* text = "Ag") {
    RenderRequest request;
    request.text = text;
    request.size = 40.0f;
    return request;
}

int CountIf(const Image& image, bool (*test)(uint32_t)) {
    int n = 0;
    for (uint32_t c : image.pixels) n += test(c);
    return n;
}

TEST(RenderTest, EveryEffectKindGivesAVisibleImageOfViewPlusMargins) {
    Image tile(4, 4, 0xFF00FF00u);
    for (const EffectSpec& spec : EffectCatalog()) {
        RenderRequest request = Sample();
        EffectRequest effect = ParseEffect(spec.kind == 11 ? std::string(spec.name) + ":tile=(memory)" : spec.name);
        for (ParamValue& v : effect.values) {
            if (v.path == "(memory)") v.image = tile;
        }
        request.effects.push_back(effect);
        const RenderResult r = Render(request);
        EXPECT_EQ(r.image.width, r.viewWidth + r.left + r.right) << spec.name;
        EXPECT_EQ(r.image.height, r.viewHeight + r.top + r.bottom) << spec.name;
        EXPECT_GT(r.viewWidth, 20) << spec.name;
        EXPECT_GT(CountIf(r.image, [](uint32_t c) { return Alpha(c) > 128; }), 50) << spec.name;
        EXPECT_FALSE(r.key.empty()) << spec.name;
    }
}

TEST(RenderTest, ARedStrokePutsRedOutsideTheGlyphEdges) {
    const RenderResult plain = Render(Sample("O"));
    RenderRequest request = Sample("O");
    request.effects.push_back(ParseEffect("stroke:size=4,color=#FF0000,position=outside"));
    const RenderResult stroked = Render(request);
    ASSERT_EQ(stroked.left, 4);
    ASSERT_EQ(stroked.top, 4);
    EXPECT_EQ(stroked.key, "K848F8F8F8F808080808081 T8F8F808080808080");

    int redOutside = 0, blackInside = 0, wrongInside = 0;
    for (int y = 0; y < stroked.image.height; ++y) {
        for (int x = 0; x < stroked.image.width; ++x) {
            const uint32_t c = stroked.image.At(x, y);
            const int px = x - stroked.left, py = y - stroked.top;
            const bool inView = px >= 0 && py >= 0 && px < plain.image.width && py < plain.image.height;
            const uint32_t glyph = inView ? Alpha(plain.image.At(px, py)) : 0;
            const bool red = Alpha(c) == 255 && Red(c) > 200 && Green(c) < 40 && Blue(c) < 40;
            if (glyph == 0 && red) ++redOutside;
            if (glyph == 255) (Red(c) < 40 && Alpha(c) == 255 ? blackInside : wrongInside) += 1;
        }
    }
    EXPECT_GT(redOutside, 100);
    EXPECT_GT(blackInside, 100);
    EXPECT_EQ(wrongInside, 0);   // the stroke lies outside: the glyph's core stays text-coloured
}

// The bounding box of the pixels that pass `test` (left > right when none).
struct Box {
    int left = INT_MAX, top = INT_MAX, right = INT_MIN, bottom = INT_MIN;
};
Box BoxOf(const Image& image, bool (*test)(uint32_t)) {
    Box box;
    for (int y = 0; y < image.height; ++y) {
        for (int x = 0; x < image.width; ++x) {
            if (!test(image.At(x, y))) continue;
            box.left = std::min(box.left, x);
            box.right = std::max(box.right, x);
            box.top = std::min(box.top, y);
            box.bottom = std::max(box.bottom, y);
        }
    }
    return box;
}

bool IsBlue(uint32_t c) { return Alpha(c) > 100 && Blue(c) > 150 && Red(c) < 60; }
bool IsBlack(uint32_t c) { return Alpha(c) > 200 && Red(c) < 30 && Blue(c) < 30; }

TEST(RenderTest, AShadowAtAngleZeroLiesToTheLeftAndNinetyBelow) {
    // An unblurred blue shadow of an "I", 12 pixels away.
    RenderRequest request = Sample("I");
    request.effects.push_back(ParseEffect("outer-shadow:angle=0,distance=12,size=0,color=#0000FF,opacity=1"));
    RenderResult r = Render(request);
    EXPECT_EQ(r.left, 12);
    EXPECT_EQ(r.right, 0);
    Box shadow = BoxOf(r.image, IsBlue), text = BoxOf(r.image, IsBlack);
    ASSERT_LE(shadow.left, shadow.right);
    EXPECT_LT(shadow.right, text.left);        // wholly to the left of the glyph
    EXPECT_NEAR(shadow.left, text.left - 12, 1);
    EXPECT_NEAR(shadow.top, text.top, 1);
    EXPECT_NEAR(shadow.bottom, text.bottom, 1);

    request.effects[0] = ParseEffect("outer-shadow:angle=90,distance=12,size=0,color=#0000FF,opacity=1");
    r = Render(request);
    EXPECT_EQ(r.bottom, 12);
    EXPECT_EQ(r.top, 0);
    shadow = BoxOf(r.image, IsBlue);
    text = BoxOf(r.image, IsBlack);
    EXPECT_NEAR(shadow.bottom, text.bottom + 12, 1);   // its top is hidden behind the glyph
    EXPECT_NEAR(shadow.left, text.left, 1);
}

TEST(RenderTest, ViewGeometryDecidesWhereTheTextSits) {
    RenderRequest request = Sample("Hi");
    request.width = 300;
    request.height = 200;
    request.align = Align::kRight;
    request.verticalGravity = 0x50;
    const RenderResult r = Render(request);
    ASSERT_EQ(r.image.width, 300);
    ASSERT_EQ(r.image.height, 200);
    const Box ink = BoxOf(r.image, IsBlack);
    EXPECT_GT(ink.left, 240);    // right aligned
    EXPECT_GT(ink.top, 150);     // at the bottom
    ASSERT_EQ(r.lines.size(), 1u);
    EXPECT_GE(r.lines[0].bounds.right, 299);   // the advance ends at the view edge
    EXPECT_LE(r.lines[0].bounds.right, 300);
    EXPECT_EQ(r.lines[0].bounds.bottom, 200);   // the font box reaches the bottom edge

    // Wrapping at the view width and a line limit.
    request.text = "one two three four five six";
    request.width = 120;
    request.height = 0;
    request.verticalGravity = 0x30;
    request.lineLimit = 2;
    const RenderResult wrapped = Render(request);
    EXPECT_GT(wrapped.layout.size(), 2u);
    EXPECT_EQ(wrapped.lines.size(), 2u);
    for (const LayoutLine& line : wrapped.layout) EXPECT_LE(line.width, 120.0f);
}

TEST(RenderTest, TheBackgroundFillsTheLineBoxesBehindTheText) {
    RenderRequest request = Sample("a b");
    request.hasBackground = true;
    request.background = 0xFF00FF00u;
    const RenderResult r = Render(request);
    ASSERT_EQ(r.lines.size(), 1u);
    const GxLineInfo& line = r.lines[0];
    EXPECT_EQ(r.image.At(line.bounds.left + 1, line.bounds.top + 1), 0xFF00FF00u);
    EXPECT_GT(CountIf(r.image, IsBlack), 20);
}

TEST(RenderTest, NonLatinTextFallsBackToTheSystemFonts) {
    // Two different ideographs: missing glyphs would both be the same box.
    const RenderResult sun = Render(Sample("\u65E5"));
    const RenderResult book = Render(Sample("\u672C"));
    ASSERT_GT(CountIf(sun.image, IsBlack), 20);
    EXPECT_TRUE(sun.image.width != book.image.width || sun.image.pixels != book.image.pixels);
}

TEST(RenderTest, RequestsBeyondTheLimitsAreRefusedBeforeRendering) {
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

}  // namespace
}  // namespace Glimmer::RenderTool

// fontconfig 2.14 loses a few hundred bytes inside FcInit, once per process.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
