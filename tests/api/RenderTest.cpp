// The public API from a caller's side: fonts, failures with their reasons,
// layer style against the exact mode, the picture's geometry, threads.
// Pictures are checked by properties of their pixels against plain renders
// of the same text; the picture table (tests/pictures/) pins exact pixels.

#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cmath>
#include <cstdio>
#include <fstream>
#include <functional>
#include <iterator>
#include <limits>
#include <thread>
#include <utility>

#include "glimmer/glimmer.h"

namespace glimmer {
namespace {

constexpr const char* kBold = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";

uint32_t Alpha(uint32_t c) { return c >> 24; }
uint32_t Red(uint32_t c) { return c >> 16 & 0xFF; }
uint32_t Blue(uint32_t c) { return c & 0xFF; }

const Font& Bold() {
    static const Font font = *Font::fromFile(kBold);
    return font;
}

Text Sample(const char* content = "Ag", float size = 40.0f) {
    return Text{.content = content, .font = Bold(), .style = {.size = size}};
}

Picture Render(const Text& text, bool exact = false) {
    Result<Picture> picture = render(text, {.exact = exact});
    EXPECT_TRUE(picture.ok()) << picture.status().message();
    return std::move(picture).value();
}

// The pixel of `p` over view pixel (x, y).
uint32_t InView(const Picture& p, int x, int y) { return p.image.at(x + p.margins.left, y + p.margins.top); }

// View pixels where `where(plain, painted)` holds; `plain` is the same text
// drawn without effects.
int Count(const Picture& plain, const Picture& painted, const std::function<bool(uint32_t, uint32_t)>& where) {
    int n = 0;
    for (int y = 0; y < plain.viewHeight; ++y) {
        for (int x = 0; x < plain.viewWidth; ++x) n += where(InView(plain, x, y), InView(painted, x, y));
    }
    return n;
}

bool OutsideButPainted(uint32_t plain, uint32_t painted) { return Alpha(plain) == 0 && Alpha(painted) != 0; }

std::string TempPath(const char* name) { return "/tmp/glimmer-api-test-" + std::to_string(getpid()) + "-" + name; }

// --- fonts

TEST(FontTest, LoadsOncePerPathOrBytes) {
    const Result<Font> font = Font::fromFile(kBold);
    ASSERT_TRUE(font.ok()) << font.status().message();
    EXPECT_EQ(font->familyName(), "DejaVu Sans");
    EXPECT_TRUE(*font == *Font::fromFile(kBold));

    std::ifstream file(kBold, std::ios::binary);
    const std::vector<char> bytes((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    const Result<Font> fromBytes = Font::fromBytes(bytes.data(), bytes.size(), "Mine-Bold.ttf");
    ASSERT_TRUE(fromBytes.ok()) << fromBytes.status().message();
    EXPECT_TRUE(*fromBytes == *Font::fromBytes(bytes.data(), bytes.size(), "Mine-Bold.ttf"));
    EXPECT_FALSE(*fromBytes == *font);
    // Either font draws the same glyphs.
    Text text = Sample("Hi");
    const Picture a = Render(text);
    text.font = *fromBytes;
    EXPECT_EQ(Render(text).image.pixels, a.image.pixels);
}

TEST(FontTest, FailuresSayWhyAndNeverBlock) {
    const std::string text = TempPath("not-a-font.ttf"), fifo = TempPath("fifo.ttf");
    std::ofstream(text) << "plain words, no font";
    ASSERT_EQ(mkfifo(fifo.c_str(), 0600), 0);
    const struct {
        Result<Font> result;
        ErrorCode code;
        const char* says;
    } cases[] = {
        {Font::fromFile("/no/such/font.ttf"), ErrorCode::kCannotRead, "cannot read '/no/such/font.ttf'"},
        {Font::fromFile("/tmp"), ErrorCode::kCannotRead, "not a regular file"},
        {Font::fromFile(fifo), ErrorCode::kCannotRead, "not a regular file"},   // opened without blocking
        {Font::fromFile(text), ErrorCode::kNotAFont, "is not a font"},
        {Font::fromFile(""), ErrorCode::kInvalidArgument, "empty"},
        {Font::fromBytes("garbage", 7, "junk.ttf"), ErrorCode::kNotAFont, "'junk.ttf' is not a font"},
        {Font::fromBytes(nullptr, 10), ErrorCode::kInvalidArgument, "no font bytes"},
    };
    for (const auto& c : cases) {
        EXPECT_EQ(c.result.status().code(), c.code) << c.says;
        EXPECT_NE(c.result.status().message().find(c.says), std::string::npos) << c.result.status().message();
        EXPECT_TRUE(c.result->empty());
    }
    std::remove(text.c_str());
    std::remove(fifo.c_str());
}

// --- failures

TEST(RenderFailureTest, BadInputGetsAReasonNeverABlankPicture) {
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const struct {
        const char* what;
        std::function<void(Text&)> spoil;
        ErrorCode code;
    } cases[] = {
        {"no font", [](Text& t) { t.font = Font(); }, ErrorCode::kInvalidArgument},
        {"empty", [](Text& t) { t.content.clear(); }, ErrorCode::kInvalidArgument},
        {"not UTF-8", [](Text& t) { t.content = "a\xFF"; }, ErrorCode::kInvalidArgument},
        {"U+0000", [](Text& t) { t.content = std::string("a\0b", 3); }, ErrorCode::kInvalidArgument},
        {"size 0", [](Text& t) { t.style.size = 0.0f; }, ErrorCode::kInvalidArgument},
        {"size NaN", [&](Text& t) { t.style.size = nan; }, ErrorCode::kInvalidArgument},
        {"fill opacity NaN", [&](Text& t) { t.style.fillOpacity = nan; }, ErrorCode::kInvalidArgument},
        {"negative width", [](Text& t) { t.layout.width = -1; }, ErrorCode::kInvalidArgument},
        {"padding too large", [](Text& t) { t.layout.padding.left = 40000; }, ErrorCode::kInvalidArgument},
        {"negative line count", [](Text& t) { t.layout.maxLines = -1; }, ErrorCode::kInvalidArgument},
        {"stroke size NaN", [&](Text& t) { t.effects = {Stroke{.size = nan}}; }, ErrorCode::kInvalidArgument},
        {"unknown stroke position",
         [](Text& t) { t.effects = {Stroke{.position = StrokePosition(7)}}; }, ErrorCode::kInvalidArgument},
        {"stops going back",
         [](Text& t) { t.effects = {OuterGlow{.stops = {{0xFFFF0000u, 0.8f}, {0xFF0000FFu, 0.2f}}}}; },
         ErrorCode::kInvalidArgument},
        {"a stop past 1", [](Text& t) { t.effects = {InnerGlow{.stops = {{0xFFFF0000u, 1.5f}}}}; },
         ErrorCode::kInvalidArgument},
        {"a gradient without stops", [](Text& t) { t.effects = {LinearGradient{.stops = {}}}; },
         ErrorCode::kInvalidArgument},
        {"an empty tile", [](Text& t) { t.effects = {Pattern{}}; }, ErrorCode::kInvalidArgument},
        {"a tile short of pixels", [](Text& t) { t.effects = {Pattern{.tile = {4, 4, {0xFF000000u}}}}; },
         ErrorCode::kInvalidArgument},
        {"a line past the text", [](Text& t) { t.layout.firstLine = 1; }, ErrorCode::kLineRange},
        {"a huge view", [](Text& t) { t.layout.width = t.layout.height = 32000; }, ErrorCode::kTooLarge},
        {"only spaces", [](Text& t) { t.content = "   "; }, ErrorCode::kInvalidArgument},
    };
    for (const auto& c : cases) {
        Text text = Sample();
        c.spoil(text);
        const Result<Picture> picture = render(text);
        EXPECT_EQ(picture.status().code(), c.code) << c.what;
        EXPECT_FALSE(picture.status().message().empty()) << c.what;
        EXPECT_TRUE(picture->image.pixels.empty()) << c.what;
    }
    Text text = Sample("one\ntwo\nthree");
    text.layout.firstLine = 3;
    EXPECT_EQ(render(text).status().message(), "line 3 lies past the text's last line (it has 3, counted from 0)");
}

// --- layer style against the exact mode

TEST(LayerStyleTest, InnerEffectsStayInsideTheGlyphs) {
    const Picture plain = Render(Sample("Hom"));
    const Effect inner[] = {Stroke{.size = 6, .color = 0xFFFFD000u, .position = StrokePosition::kInside},
                            InnerGlow{.size = 6, .opacity = 1.0f}, InnerShadow{.opacity = 1.0f}, Bevel{},
                            LinearGradient{}, Pattern{.tile = {2, 2, {0xFFFF0000u, 0xFF00FF00u, 0xFF0000FFu, 0u}}}};
    for (const Effect& effect : inner) {
        Text text = Sample("Hom");
        text.effects = {effect};
        EXPECT_EQ(Count(plain, Render(text), OutsideButPainted), 0) << effect.index();
    }
    // The engine itself fills the whole line box around the letters.
    Text text = Sample("Hom");
    text.effects = {Stroke{.size = 6, .color = 0xFFFFD000u, .position = StrokePosition::kInside}};
    EXPECT_GT(Count(plain, Render(text, true), OutsideButPainted), 500);
}

TEST(LayerStyleTest, ShadowsUnderTheOutlineWhateverTheOrderOfAdding) {
    const Stroke stroke{.size = 5, .color = 0xFFFFD000u};
    const OuterShadow shadow{.angle = 90, .distance = 6, .size = 0, .color = 0xFF0000FFu, .opacity = 1.0f};
    Text text = Sample("Hom");
    text.effects = {stroke};
    const Picture outline = Render(text);
    text.effects = {stroke, shadow};
    const Picture strokeFirst = Render(text);
    text.effects = {shadow, stroke};
    const Picture shadowFirst = Render(text);
    EXPECT_EQ(strokeFirst.image.pixels, shadowFirst.image.pixels);
    EXPECT_EQ(strokeFirst.key, shadowFirst.key);

    // Outline pixels the shadow covers: none in layer style; in the exact mode
    // the shadow added last lies over the outline.
    auto shadowOverOutline = [&](const Picture& p) {
        int n = 0;
        for (int y = 0; y < outline.image.height; ++y) {
            for (int x = 0; x < outline.image.width; ++x) {
                const uint32_t o = outline.image.at(x, y), c = p.image.at(x, y);
                n += Alpha(o) == 255 && Red(o) == 255 && Blue(c) > 200 && Red(c) < 50;
            }
        }
        return n;
    };
    EXPECT_EQ(shadowOverOutline(strokeFirst), 0);
    text.effects = {stroke, shadow};
    EXPECT_GT(shadowOverOutline(Render(text, true)), 100);

    // The same holds for every effect kind at once, in any order.
    text.effects = {Bevel{},     InnerGlow{},  OuterGlow{},   LinearGradient{},
                    InnerShadow{}, RadialGradient{}, Emboss{}, stroke, shadow};
    const Picture all = Render(text);
    std::reverse(text.effects.begin(), text.effects.end());
    EXPECT_EQ(Render(text).image.pixels, all.image.pixels);
}

TEST(LayerStyleTest, FillOpacityFadesOnlyTheFill) {
    const Picture plain = Render(Sample("Hom"));
    auto deepInside = [](uint32_t plain, uint32_t) { return Alpha(plain) == 255; };
    Text text = Sample("Hom");
    text.style.fillOpacity = 0.0f;
    text.effects = {Stroke{.size = 3, .color = 0xFFD7263Du}};
    const Picture outline = Render(text);
    EXPECT_EQ(Count(plain, outline, [](uint32_t plain, uint32_t c) { return Alpha(plain) == 255 && Alpha(c) != 0; }),
              0);
    EXPECT_GT(Count(plain, outline, [](uint32_t plain, uint32_t c) { return Alpha(plain) == 0 && Alpha(c) == 255; }),
              300);

    text.style.fillOpacity = 0.5f;
    const Picture half = Render(text);
    const int inside = Count(plain, half, deepInside);
    EXPECT_EQ(Count(plain, half, [](uint32_t plain, uint32_t c) {
                  return Alpha(plain) == 255 && (Alpha(c) < 120 || Alpha(c) > 135);
              }),
              0)
        << "of " << inside;

    // The exact mode keeps the engine's text opacity: the fill stays opaque.
    text.style.fillOpacity = 0.0f;
    EXPECT_EQ(Count(plain, Render(text, true), [](uint32_t plain, uint32_t c) {
                  return Alpha(plain) == 255 && Alpha(c) == 255;
              }),
              inside);

    // The fill colour's alpha fades everything, the outline too.
    text.style = {.size = 40.0f, .color = 0x80000000u};
    const Picture faded = Render(text);
    EXPECT_EQ(Count(plain, faded, [](uint32_t plain, uint32_t c) { return Alpha(plain) == 0 && Alpha(c) > 130; }), 0);
}

TEST(LayerStyleTest, OpacitiesAndColourAlphasFadeTheirEffect) {
    const Picture plain = Render(Sample("Hom"));
    Text text = Sample("Hom");
    // A transparent stroke colour, a ramp at opacity 0: nothing of either shows.
    text.effects = {Stroke{.size = 4, .color = 0x00FF0000u}, LinearGradient{.opacity = 0.0f}};
    EXPECT_EQ(Count(plain, Render(text), [](uint32_t a, uint32_t b) { return a != b; }), 0);
    text.effects = {OuterGlow{.opacity = 1.0f, .stops = {{0xFFFF0000u, 0.0f, 0.0f}, {0x00FF0000u, 1.0f}}}};
    const Picture glow = Render(text);
    EXPECT_EQ(Count(plain, glow, OutsideButPainted), 0);
}

// --- geometry

TEST(RenderGeometryTest, ThePictureIsTheViewPlusMarginsAndTheLinesSayWhereTheyAre) {
    Text text = Sample("ab\n\xC3\xA9t\xC3\xA9");   // "été" on the second line
    text.effects = {Stroke{.size = 4}};
    const Picture p = Render(text);
    EXPECT_EQ(p.margins.left, 4);
    EXPECT_EQ(p.margins.bottom, 4);
    EXPECT_EQ(p.image.width, p.viewWidth + 8);
    EXPECT_EQ(p.image.height, p.viewHeight + 8);
    ASSERT_EQ(p.lines.size(), 2u);
    EXPECT_EQ(p.lines[0].begin, 0u);
    EXPECT_EQ(p.lines[0].end, 2u);
    EXPECT_EQ(p.lines[1].begin, 3u);
    EXPECT_EQ(p.lines[1].end, 8u);
    for (const Line& line : p.lines) {
        EXPECT_EQ(line.x, p.margins.left);
        EXPECT_LT(line.top, line.baseline);
        EXPECT_GT(line.bottom, line.baseline);
        EXPECT_LE(line.width, p.viewWidth);
    }
}

TEST(RenderGeometryTest, TheKeyNamesEveryLayerWithItsParameters) {
    Text text = Sample("O");
    text.effects = {Stroke{.size = 4, .color = 0xFFFF0000u}};
    // Stroke 'K' (size 4, opaque red, outside), then the text 'T' (opaque black).
    EXPECT_EQ(Render(text, true).key, "K848F8F8F8F808080808081 T8F8F808080808080");
    EXPECT_EQ(Render(text).key, "K848F8F8F8F808080808081 T8F8F808080808080");
}

// --- text

TEST(RenderTextTest, OtherScriptsFallBackToTheSystemFonts) {
    // Two different ideographs: missing glyphs would both be the same box.
    const Picture sun = Render(Sample("\xE6\x97\xA5"));
    const Picture book = Render(Sample("\xE6\x9C\xAC"));
    EXPECT_GT(Count(sun, sun, [](uint32_t c, uint32_t) { return Alpha(c) == 255; }), 20);
    EXPECT_NE(sun.image.pixels, book.image.pixels);
    // So do scripts no family serves (Syriac, Javanese) and emoji, from any installed font that has them.
    for (auto pair : {std::pair{"\xDC\x90", "\xDC\x92"}, std::pair{"\xEA\xA6\xB2", "\xEA\xA6\x8F"},
                      std::pair{"\xF0\x9F\x8E\x89", "\xF0\x9F\x8E\x88"}}) {
        const Picture first = Render(Sample(pair.first));
        EXPECT_NE(first.image.pixels, Render(Sample(pair.second)).image.pixels) << pair.first;
        EXPECT_GT(Count(first, first, [](uint32_t c, uint32_t) { return Alpha(c) == 255; }), 20) << pair.first;
    }
}

TEST(RenderTextTest, RendersOnSeveralThreadsGiveOnePicture) {
    Text text = Sample("Threads");
    text.effects = {Stroke{}, OuterGlow{}};
    const Picture reference = Render(text);
    std::vector<std::thread> threads;
    std::vector<int> mismatches(4, 0);
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([&, t] {
            for (int i = 0; i < 5; ++i) {
                const Result<Picture> p = render(text);
                mismatches[size_t(t)] += !p.ok() || p->image.pixels != reference.image.pixels;
            }
        });
    }
    for (std::thread& thread : threads) thread.join();
    EXPECT_EQ(mismatches, std::vector<int>(4, 0));
}

}  // namespace
}  // namespace glimmer

// fontconfig 2.14 loses a few hundred bytes inside FcInit, once per process.
extern "C" const char* __lsan_default_suppressions() { return "leak:libfontconfig.so\n"; }
