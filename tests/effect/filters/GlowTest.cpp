// The glows: the colour table and the box spread they share, the outer and
// the inner glow by hand on tiny masks, and the edges.

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxInnerGlow.h"
#include "effect/filters/GxOuterGlow.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;
using Testing::Stop;

constexpr uint32_t kRed = 0xFFFF0000u, kBlack = 0xFF000000u, kWhite = 0xFFFFFFFFu;

template <typename Layer = GxOuterGlow, typename Record = GxOuterGlowProperty>
std::unique_ptr<Layer> Glow(float size, uint32_t color, std::vector<GxGradient> stops = {}) {
    auto glow = std::make_unique<Layer>();
    Record record(size, color, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    glow->setProperty(&record);
    return glow;
}

auto Inner(float size, uint32_t color) { return Glow<GxInnerGlow, GxInnerGlowProperty>(size, color); }

TEST(GlowColorTable, SingleColourRampsAndTheFade) {
    const std::vector<GxGradient> bw{Stop(kBlack, 0), Stop(kWhite, 1)};
    const struct {
        float size;
        std::vector<GxGradient> stops;
        float fadeStart;
        int curve, entry;
        uint32_t expected;
        const char* why;
    } cases[] = {
        {0, {}, 0.3f, 0, 10, 0u, "size 0: all transparent"},
        // k = trunc(double(0.3f) * 256) = 76 keeps its alpha; then 255 * trunc((256 - j) * 256 / 180) >> 8.
        {5, {}, 0.3f, 0, 76, kRed, "the fade starts after entry 76"},
        {5, {}, 0.3f, 0, 77, 0xFDFF0000u, "first faded entry"},
        {5, {}, 0.3f, 0, 200, 0x4EFF0000u, "faded"},
        {5, {}, 0.3f, 0, 255, 0x00FF0000u, "faded out"},
        {5, {}, 0.3f, 0, 256, 0u, "the last entry is wholly transparent"},
        {5, {}, 1.5f, 0, 254, 0xA9FF0000u, "fade start clamped to 0.99 (k = 253)"},
        {5, {}, -1.0f, 0, 3, 0xFDFF0000u, "and to 0.01 (k = 2)"},
        {5, {Stop(0xFF00FF00u, 0.7f)}, 0.3f, 0, 1, 0xFF00FF00u, "one stop: its colour, not the glow's"},
        {5, bw, 0.99f, 0, 128, 0xFF7F7F7Fu, "(255 * 128) >> 8"},
        {5, bw, 0.99f, 2, 128, 0xFF3F3F3Fu, "eased: u = t^2"},
        {5, bw, 0.99f, 1, 128, 0xFFB4B4B4u, "eased: u = sqrt t"},
        {5, {Stop(0x00000000u, 0.5f), Stop(kWhite, 1)}, 0.99f, 0, 128, 0x7F7F7F7Fu,
         "the first segment runs from 0 whatever stop 0's position; alpha mixes too"},
        // Stops closer than 1/256: one stop per entry, so the table lags behind t.
        {5, {Stop(kRed, 0), Stop(0xFF00FF00u, 0.001f), Stop(0xFF0000FFu, 0.002f), Stop(kBlack, 0.003f), Stop(kWhite, 1)},
         0.99f, 0, 3, 0xFF010101u, "f = trunc((3/256 - 0.003) / 0.997 * 256) = 2"},
        {5, {Stop(kBlack, 0), Stop(kWhite, 0.25f)}, 0.99f, 0, 200, kWhite, "past the last stop: its colour"},
    };
    for (const auto& c : cases) {
        std::vector<uint32_t> table(257, 0xDEADBEEFu);
        Glow(c.size, kRed, c.stops)->makeColorLUT(table.data(), c.fadeStart, c.curve);
        EXPECT_EQ(table[c.entry], c.expected) << c.why << " (entry " << c.entry << ")";
    }
    GxOuterGlowProperty nullStops(5.0f, kRed, 1.0f, 3, nullptr);
    uint32_t table[257];
    MakeGlowColorTable(table, &nullStops, 0.3f, 0);
    EXPECT_EQ(table[10], kRed) << "null stops with a count must give the glow's colour";
}

TEST(GlowBoxFilter, SpreadsByHandAndTheContentBoxGivesTheWholePlaneResult) {
    std::vector<unsigned char> p(7 * 7, 0);
    p[3 * 7 + 3] = 255;
    GxOuterGlow glow;
    glow.increaseByBoxFilter(p.data(), 2, 7, 7);
    EXPECT_EQ(p[3 * 7 + 3], 141);  // 63 around after one pass; 9 * 63 / 4
    EXPECT_EQ(p[2 * 7 + 3], 94);   // 6 * 63 / 4
    EXPECT_EQ(p[1 * 7 + 1], 15);
    // Capped at 255; rewritten rows get 0 at both ends.
    std::vector<unsigned char> full(5 * 4, 255);
    glow.increaseByBoxFilter(full.data(), 1, 5, 4);
    EXPECT_EQ(full, (std::vector<unsigned char>{255, 255, 255, 255, 255, 0, 255, 255, 255, 0,
                                                0, 255, 255, 255, 0, 255, 255, 255, 255, 255}));
    glow.increaseByBoxFilter(nullptr, 1, 5, 4);

    // Told where the content lies on a frame of 0 or 255, the spread rewrites
    // less and must give the same bytes, row ends and small planes included.
    std::mt19937 rng(3);
    for (int trial = 0; trial < 60; ++trial) {
        const int w = 1 + int(rng() % 40), h = 3 + int(rng() % 30);
        const uint8_t frame = trial % 2 ? 255 : 0;
        const int left = int(rng() % unsigned(w)), top = int(rng() % unsigned(h));
        const GxRect content(left, top, left + 1 + int(rng() % unsigned(w - left)),
                             top + 1 + int(rng() % unsigned(h - top)));
        std::vector<unsigned char> whole(size_t(w) * h, frame);
        for (int y = content.top; y < content.bottom; ++y)
            for (int x = content.left; x < content.right; ++x) whole[size_t(y) * w + x] = rng() % 3 ? uint8_t(rng()) : frame;
        std::vector<unsigned char> part = whole;
        const int passes = 1 + int(rng() % 6);
        ASSERT_TRUE(GlowBoxFilter(whole.data(), passes, w, h, nullptr));
        ASSERT_TRUE(GlowBoxFilter(part.data(), passes, w, h, nullptr, content));
        ASSERT_EQ(part, whole) << "the content-box spread differs, trial " << trial;
    }
}

TEST(OuterGlow, SinglePixelAtSizeOneByHand) {
    // g = 2: one box pass (3 x 3 of 63); Rg = 1, weights {128, 1}, S = 130,
    // blurred to 63 / 62 / 61; table[256 - v] faded gives alpha 88 / 87 / 85.
    LayerCanvas c(9, 9);
    c.Glyph(4, 4, 5, 5).Run(*Glow(1.0f, kRed));
    const int a[3][3] = {{85, 87, 85}, {87, 88, 87}, {85, 87, 85}};
    for (int y = 0; y < 9; ++y)
        for (int x = 0; x < 9; ++x) {
            int v = (x >= 3 && x <= 5 && y >= 3 && y <= 5) ? a[y - 3][x - 3] : 0;
            ASSERT_EQ(c.At(x, y), (Px{v, 0, 0, v})) << x << "," << y;
        }
    // Premultiplied: alpha 128 * 89 >> 8 = 44.
    EXPECT_EQ(LayerCanvas(9, 9).Glyph(4, 4, 5, 5).Run(*Glow(1.0f, 0x80FF0000u)).At(4, 4), (Px{44, 0, 0, 44}));
    for (float size : {0.0f, -1.5f, -7.0f})
        EXPECT_TRUE(LayerCanvas(9, 9).Glyph(3, 3, 6, 6).Run(*Glow(size, kRed)).Untouched()) << "size " << size << " drew";
    EXPECT_EQ(Glow(2.4f, kRed)->getOffset(), 2);
    EXPECT_EQ(Glow(2.5f, kRed)->getOffset(), 3) << "the margin is the size rounded half up";
}

TEST(OuterGlow, KeepsItsOwnStopsAndClipsToTheCanvas) {
    auto* stops = new GxGradient[2]{Stop(kRed, 0), Stop(0xFF0000FFu, 1)};
    GxOuterGlowProperty record(3.0f, kWhite, 1.0f, 2, stops);
    GxOuterGlow glow;
    glow.setProperty(&record);
    LayerCanvas before(20, 20);
    before.Glyph(8, 8, 12, 12).Run(glow);
    delete[] stops;
    record.stops = nullptr;
    LayerCanvas after(20, 20);
    EXPECT_TRUE(after.Glyph(8, 8, 12, 12).Run(glow).SameAs(before)) << "the glow read the caller's freed stops";
    EXPECT_GT(after.At(12, 10)[0], after.At(12, 10)[2]) << "the first stop must lie at the glyph edge";

    auto big = Glow(6.0f, kRed);
    LayerCanvas exact(10, 10), hanging(10, 10), away(10, 10);
    exact.Glyph(6, 6, 10, 10).Run(*big);
    hanging.Glyph(6, 6, 10, 10).box = GxRect(6, 6, 40, 40);
    EXPECT_TRUE(hanging.Run(*big).SameAs(exact)) << "a box past the canvas must act as the box clipped to it";
    away.box = GxRect(20, 20, 30, 30);
    EXPECT_TRUE(away.Run(*big).Untouched());
    GxBitmap tiny(2, 2, 4);  // a destination smaller than the glow image
    GxECore::ParamPostProcessing pp{&tiny, &exact.mask, &exact.box, 0, nullptr};
    big->doPostProcessing(&pp);
    big->doPostProcessing(nullptr);
}

TEST(InnerGlow, SquareAtSizeOneByHand) {
    // A 7 x 7 glyph, g = 2: the image is 15 x 15 at (0, 0). After one box
    // pass the inverted plane is 191 along the glyph's edge, 0 inside, 255
    // outside; Rg = 1, weights {128, 1}, S = 130.
    LayerCanvas c(15, 15);
    c.Glyph(4, 4, 11, 11).Run(*Inner(1.0f, kRed));
    const Px white{255, 255, 255, 255}, red{255, 0, 0, 255}, clear{0, 0, 0, 0};
    // The frame the passes do not reach: opaque white, kept outside the glyph.
    for (int i = 0; i < 15; ++i) EXPECT_TRUE(c.At(i, 0) == white && c.At(14, i) == white) << i;
    EXPECT_EQ(c.At(1, 1), red);  // processed, outside: entry 1
    EXPECT_EQ(c.At(7, 4), red);  // edge row: outside coverage 191, entry 65
    EXPECT_EQ(c.At(7, 5), (Px{1, 0, 0, 1}));  // outside coverage 2: entry 254, alpha 1
    // The passes truncate differently across and along: one column in is
    // already entry 255, alpha 0.
    EXPECT_EQ(c.At(5, 7), clear);
    for (float size : {0.0f, -1.5f, -3.0f})
        EXPECT_TRUE(LayerCanvas(15, 15).Glyph(4, 4, 11, 11).Run(*Inner(size, kRed)).Untouched()) << size;
}

}  // namespace
}  // namespace Glimmer
