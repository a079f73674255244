// The compositor: each blend rule on hand-computed pixels, the clipping
// edges, the refusals, and a property that holds for every input.

#include <gtest/gtest.h>

#include <array>
#include <climits>
#include <cstdint>
#include <cstring>
#include <vector>

#include "effect/GxBlender.h"
#include "foundation/GxBitmap.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

using Px = std::array<int, 4>;  // R, G, B, A

void Set(GxBitmap& b, int x, int y, Px p) {
    uint8_t* d = b.pixels + (size_t(y) * b.width + x) * 4;
    for (int c = 0; c < 4; ++c) d[c] = uint8_t(p[c]);
}

Px Get(const GxBitmap& b, int x, int y) {
    const uint8_t* d = b.pixels + (size_t(y) * b.width + x) * 4;
    return {d[0], d[1], d[2], d[3]};
}

// How one source pixel reaches the destination.
enum Source {
    kCoverage,  // a coverage byte m in `color`, through drawBitmapBlend8 in `mode`
    kWord,      // the 32-bit word `color`, through drawBitmapBlend32 in `mode`
    kBytes,     // the bytes R, G, B, A of `color` (0xRRGGBBAA), destination-over, flag = mode
    kOverwrite  // coverage m as the alpha of `color`, through drawBitmap
};

Px Draw(Source source, int mode, uint32_t color, Px dst, uint8_t m) {
    GxBitmap b(1, 1, 4);
    Set(b, 0, 0, dst);
    const uint8_t bytes[4] = {uint8_t(color >> 24), uint8_t(color >> 16), uint8_t(color >> 8), uint8_t(color)};
    switch (source) {
        case kCoverage: GxBlender::drawBitmapBlend8(0, 0, &b, &m, 1, 1, 1, color, mode); break;
        case kWord: GxBlender::drawBitmapBlend32(0, 0, &b, &color, 1, 1, 1, mode); break;
        case kBytes: GxBlender::drawBitmapBlend32(0, 0, &b, bytes, 1, 1, 1, 0, mode); break;
        case kOverwrite: GxBlender::drawBitmap(0, 0, &b, &m, 1, 1, color); break;
    }
    return Get(b, 0, 0);
}

TEST(BlenderRules, OnePixelByHand) {
    const struct {
        Source source;
        int mode;
        uint32_t color;
        Px dst;
        uint8_t m;
        Px expected;
        const char* rule;
    } cases[] = {
        {kCoverage, 1, 0x80FF8040, {10, 20, 30, 40}, 255, {255, 138, 79, 148}, "source-over: s = 129 * 255, a = 128"},
        {kCoverage, 1, 0xFFFFFFFF, {0, 0, 0, 0}, 1, {1, 1, 1, 1}, "(255 + 1) * 1 leaves a trace"},
        {kCoverage, 2, 0xFF204060, {100, 50, 25, 128}, 128, {108, 66, 49, 191}, "destination-over, partial"},
        {kCoverage, 3, 0x80402010, {10, 10, 10, 100}, 1, {49, 29, 20, 178}, "switch over partial"},
        {kCoverage, 3, 0x80402010, {10, 10, 10, 100}, 0, {10, 10, 10, 100}, "switch off"},
        {kCoverage, 7, 0xFF808080, {10, 20, 30, 100}, 255, {88, 98, 108, 255}, "fill: full coverage, unscaled"},
        {kCoverage, 7, 0xFF808080, {200, 100, 50, 255}, 128, {100, 50, 25, 128}, "fill over opaque halves"},
        {kCoverage, 7, 0xFF808080, {40, 40, 40, 100}, 128, {40, 40, 40, 89}, "fill: combined, then scaled"},
        {kCoverage, 7, 0xFFFF0000, {255, 0, 0, 1}, 254, {255, 0, 0, 253}, "saturates past 16 bits (not 249)"},
        {kWord, 1, 0x80402010, {100, 100, 100, 200}, 0, {114, 82, 66, 227}, "image source-over"},
        {kWord, 2, 0x80402010, {10, 10, 10, 100}, 0, {49, 29, 20, 178}, "image destination-over"},
        {kWord, 2, 0x00402010, {0, 0, 0, 0}, 0, {0, 0, 0, 0}, "transparent image destination-over"},
        {kWord, 3, 0x80402010, {7, 7, 7, 7}, 0, {7, 7, 7, 7}, "images know no mode 3"},
        {kBytes, 0, 0x40201080, {10, 10, 10, 100}, 0, {49, 29, 20, 178}, "byte image destination-over"},
        {kBytes, 1, 0x40201080, {5, 5, 5, 0}, 0, {64, 32, 16, 128}, "flag: over alpha 0 the source as it is"},
        {kBytes, 0, 0x40201080, {5, 5, 5, 0}, 0, {69, 37, 21, 128}, "no flag: colour under alpha 0 summed in"},
        {kOverwrite, 0, 0x80112233, {9, 9, 9, 9}, 200, {0x11, 0x22, 0x33, 100}, "overwrite: colour unscaled"},
    };
    for (const auto& c : cases) EXPECT_EQ(Draw(c.source, c.mode, c.color, c.dst, c.m), c.expected) << c.rule;
    for (int mode : {0, 4, 5, 6, 8, -1, 1000})
        EXPECT_EQ(Draw(kCoverage, mode, ~0u, Px{1, 2, 3, 4}, 255), (Px{1, 2, 3, 4})) << "unknown mode " << mode;
}

TEST(BlenderRules, OnlyTheTwoDestinationOverModesLog) {
    Testing::LogCapture log;
    for (int mode : {1, 2, 3, 7, 4}) Draw(kCoverage, mode, 0xFF000000, Px{0, 0, 0, 0}, 1);
    const auto lines = log.Lines();
    ASSERT_EQ(lines.size(), 2u);
    EXPECT_EQ(lines[0].message, "Blender - GxE_BLEND_DST_OVER_NSA");
    EXPECT_EQ(lines[1].message, "Blender - GxE_BLEND_OTHER");
}

TEST(BlenderRules, RedBlueSwapGivesJavaWordsAndLeavesMasksAlone) {
    GxBitmap b(1, 1, 4), mask(2, 2, 1);
    Set(b, 0, 0, Px{0xFF, 0x80, 0x00, 0x7F});
    GxBlender::convertBGRAToARGB(&b);
    EXPECT_EQ(Get(b, 0, 0), (Px{0x00, 0x80, 0xFF, 0x7F})) << "little-endian Java reads the word 0x7FFF8000";
    mask.pixels[0] = 1;
    GxBlender::convertBGRAToARGB(&mask);
    GxBlender::convertBGRAToARGB(nullptr);
    EXPECT_EQ(mask.pixels[0], 1) << "a mask was treated as a colour image";
}

// --- clipping

TEST(BlenderClip, EachEdgeEntersTheSourceAtTheRightPlace) {
    // A 3x2 source with a row stride of 5 (0xEE is padding that must never
    // be read), drawn into a clear 4x3 image. Source-over of an opaque colour
    // over alpha 0 leaves alpha = m, so the alpha plane shows which source
    // byte landed where.
    const uint8_t src[10] = {1, 2, 3, 0xEE, 0xEE, 11, 12, 13, 0xEE, 0xEE};
    auto run = [&](int x, int y) {
        GxBitmap b(4, 3, 4);
        std::memset(b.pixels, 0, 4 * 4 * 3);
        GxBlender::drawBitmapBlend8(x, y, &b, src, 3, 2, 5, 0xFF000000, 1);
        std::vector<int> alpha;
        for (int i = 0; i < 12; ++i) alpha.push_back(b.pixels[i * 4 + 3]);
        return alpha;
    };
    using V = std::vector<int>;
    EXPECT_EQ(run(0, 0), (V{1, 2, 3, 0, 11, 12, 13, 0, 0, 0, 0, 0}));
    EXPECT_EQ(run(-1, -1), (V{12, 13, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0}));
    EXPECT_EQ(run(3, 2), (V{0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1}));
    EXPECT_EQ(run(2, -1), (V{0, 0, 11, 12, 0, 0, 0, 0, 0, 0, 0, 0}));
    // Wholly outside on every side, and placements that would overflow.
    for (auto [x, y] : std::vector<std::pair<int, int>>{{4, 0}, {0, 3}, {-3, 0}, {0, -2}, {INT_MAX, 0},
                                                         {0, INT_MAX}, {INT_MIN, INT_MIN}})
        EXPECT_EQ(run(x, y), V(12, 0)) << "drawn at " << x << "," << y;

    // Image sources clip alike: 3x2 words, alpha = index + 1.
    uint32_t words[6];
    for (int i = 0; i < 6; ++i) words[i] = uint32_t(i + 1) << 24;
    GxBitmap b(2, 2, 4);
    GxBlender::drawBitmapBlend32(-1, 1, &b, words, 3, 2, 3, 2);
    EXPECT_EQ((V{Get(b, 0, 0)[3], Get(b, 1, 0)[3], Get(b, 0, 1)[3], Get(b, 1, 1)[3]}), (V{0, 0, 2, 3}));
}

TEST(BlenderClip, MissingOrMismatchedInputsAreNoOps) {
    const uint8_t m = 255;
    const uint32_t word = 0xFFFFFFFF;
    GxBitmap color(1, 1, 4), mask(1, 1, 1), empty;
    for (int mode : {1, 2, 3, 7}) {
        GxBlender::drawBitmapBlend8(0, 0, nullptr, &m, 1, 1, 1, word, mode);
        GxBlender::drawBitmapBlend8(0, 0, &color, nullptr, 1, 1, 1, word, mode);
        GxBlender::drawBitmapBlend8(0, 0, &empty, &m, 1, 1, 1, word, mode);
        GxBlender::drawBitmapBlend8(0, 0, &mask, &m, 1, 1, 1, word, mode);  // would overrun a mask
        GxBlender::drawBitmapBlend8(0, 0, &color, &m, 0, 1, 1, word, mode);
        GxBlender::drawBitmapBlend8(0, 0, &color, &m, 1, -1, 1, word, mode);
    }
    GxBlender::drawBitmapBlend32(0, 0, &mask, &word, 1, 1, 1, 1);
    GxBlender::drawBitmap(0, 0, &color, &empty, 0);
    EXPECT_TRUE(Get(color, 0, 0) == (Px{0, 0, 0, 0}) && mask.pixels[0] == 0) << "a refused input drew";
}

TEST(BlenderProperties, DestinationOverNeverChangesAnOpaquePixel) {
    GxBitmap b(256, 1, 4);
    std::vector<uint8_t> m(256), full(256, 255);
    std::vector<uint32_t> words(256);
    for (int i = 0; i < 256; ++i)
        Set(b, i, 0, Px{i, 255 - i, i / 2, 255}), m[i] = uint8_t(i), words[i] = uint32_t(i) * 0x01010101u;
    std::vector<uint8_t> before(b.pixels, b.pixels + 256 * 4);
    for (unsigned color : {0xFFFFFFFFu, 0x80402010u, 0x01FF00FFu}) {
        for (int mode : {2, 3}) GxBlender::drawBitmapBlend8(0, 0, &b, m.data(), 256, 1, 256, color, mode);
        GxBlender::drawBitmapBlend8(0, 0, &b, full.data(), 256, 1, 256, color, 7);  // the fill at full coverage
    }
    GxBlender::drawBitmapBlend32(0, 0, &b, words.data(), 256, 1, 256, 2);
    EXPECT_EQ(std::vector<uint8_t>(b.pixels, b.pixels + 256 * 4), before) << "an opaque pixel changed";
}

}  // namespace
}  // namespace Glimmer
