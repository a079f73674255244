// The glow machinery (colour table, box spread) and the outer glow layer:
// hand-computed values on tiny masks, then properties on larger ones.

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxOuterGlow.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;
using Testing::Stop;

constexpr uint32_t kRed = 0xFFFF0000u, kBlack = 0xFF000000u, kWhite = 0xFFFFFFFFu;

std::unique_ptr<GxOuterGlow> Glow(float size, uint32_t color, std::vector<GxGradient> stops = {}) {
    auto glow = std::make_unique<GxOuterGlow>();
    GxOuterGlowProperty record(size, color, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    glow->setProperty(&record);
    return glow;
}

std::vector<uint32_t> Table(float size, uint32_t color, std::vector<GxGradient> stops, float fadeStart,
                            int curve = 0) {
    std::vector<uint32_t> table(257, 0xDEADBEEFu);
    Glow(size, color, stops)->makeColorLUT(table.data(), fadeStart, curve);
    return table;
}

TEST(GlowColorTable, SingleColourAndTheFade) {
    EXPECT_EQ(Table(0.0f, kRed, {}, 0.3f), std::vector<uint32_t>(257, 0u));  // size 0: transparent
    auto t = Table(5.0f, kRed, {}, 0.3f);
    // k = trunc(double(0.3f) * 256) = 76 keeps its alpha; then 255 * trunc((256 - j) * 256 / 180) >> 8.
    EXPECT_EQ(t[76], kRed);
    EXPECT_EQ(t[77], 0xFDFF0000u);
    EXPECT_EQ(t[200], 0x4EFF0000u);
    EXPECT_EQ(t[255], 0x00FF0000u);
    EXPECT_EQ(t[256], 0u);
    // Fade start clamped to 0.99 (k = 253) and 0.01 (k = 2).
    EXPECT_EQ(Table(5.0f, kRed, {}, 1.5f)[254] >> 24, 169u);
    EXPECT_EQ(Table(5.0f, kRed, {}, -1.0f)[3] >> 24, 253u);
    // One stop: its colour, not the glow's. Null stops with a count: the glow's.
    EXPECT_EQ(Table(5.0f, kRed, {Stop(0xFF00FF00u, 0.7f)}, 0.3f)[1], 0xFF00FF00u);
    GxOuterGlowProperty nullStops(5.0f, kRed, 1.0f, 3, nullptr);
    GxOuterGlow glow;
    glow.setProperty(&nullStops);
    uint32_t table[257];
    glow.makeColorLUT(table, 0.3f, 0);
    EXPECT_EQ(table[10], kRed);
}

TEST(GlowColorTable, RampFromZeroEasedAndLagging) {
    const std::vector<GxGradient> bw{Stop(kBlack, 0), Stop(kWhite, 1)};
    EXPECT_EQ(Table(5.0f, kRed, bw, 0.99f)[128], 0xFF7F7F7Fu);     // (255 * 128) >> 8
    EXPECT_EQ(Table(5.0f, kRed, bw, 0.99f, 2)[128], 0xFF3F3F3Fu);  // u = t^2
    EXPECT_EQ(Table(5.0f, kRed, bw, 0.99f, 1)[128], 0xFFB4B4B4u);  // u = sqrt t
    // The first segment runs from 0 whatever stop 0's position; alpha mixes too.
    EXPECT_EQ(Table(5.0f, kRed, {Stop(0x00000000u, 0.5f), Stop(kWhite, 1)}, 0.99f)[128], 0x7F7F7F7Fu);
    // Stops closer than 1/256: one stop per entry, so the table lags behind t.
    auto lag = Table(5.0f, kRed,
                     {Stop(kRed, 0), Stop(0xFF00FF00u, 0.001f), Stop(0xFF0000FFu, 0.002f), Stop(kBlack, 0.003f),
                      Stop(kWhite, 1)},
                     0.99f);
    EXPECT_EQ(lag[1], 0xFF0000FFu);
    EXPECT_EQ(lag[2], kBlack);
    EXPECT_EQ(lag[3], 0xFF010101u);  // f = trunc((3/256 - 0.003) / 0.997 * 256) = 2
    // Stops ending early: the last colour, never a stop past the array.
    EXPECT_EQ(Table(5.0f, kRed, {Stop(kBlack, 0), Stop(kWhite, 0.25f)}, 0.99f)[200], kWhite);
}

TEST(GlowBoxFilter, SpreadsFromTheRowsAsTheyWereAndClearsRowEnds) {
    std::vector<unsigned char> p(7 * 7, 0);
    p[3 * 7 + 3] = 255;
    GxOuterGlow glow;
    glow.increaseByBoxFilter(p.data(), 1, 7, 7);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) ASSERT_EQ(p[y * 7 + x], (y > 1 && y < 5 && x > 1 && x < 5) ? 63 : 0);
    glow.increaseByBoxFilter(p.data(), 1, 7, 7);
    EXPECT_EQ(p[3 * 7 + 3], 141);  // 9 * 63 / 4
    EXPECT_EQ(p[2 * 7 + 3], 94);   // 6 * 63 / 4
    EXPECT_EQ(p[1 * 7 + 1], 15);

    // Capped at 255; rewritten rows get 0 at both ends.
    std::vector<unsigned char> full(5 * 4, 255);
    glow.increaseByBoxFilter(full.data(), 1, 5, 4);
    EXPECT_EQ(full, (std::vector<unsigned char>{255, 255, 255, 255, 255, 0, 255, 255, 255, 0,
                                                0, 255, 255, 255, 0, 255, 255, 255, 255, 255}));
    glow.increaseByBoxFilter(nullptr, 1, 5, 4);
}

// Told where the content lies on a frame of 0 or 255, the spread rewrites
// less and gives the same bytes, including the row ends and small planes.
TEST(GlowBoxFilter, ContentBoxGivesTheWholePlaneResult) {
    std::mt19937 rng(3);
    for (int trial = 0; trial < 60; ++trial) {
        const int w = 1 + int(rng() % 40), h = 3 + int(rng() % 30);
        const uint8_t frame = trial % 2 ? 255 : 0;
        const int left = int(rng() % unsigned(w)), top = int(rng() % unsigned(h));
        const GxRect content(left, top, left + 1 + int(rng() % unsigned(w - left)),
                             top + 1 + int(rng() % unsigned(h - top)));
        std::vector<unsigned char> whole(size_t(w) * h, frame);
        for (int y = content.top; y < content.bottom; ++y)
            for (int x = content.left; x < content.right; ++x)
                whole[size_t(y) * w + x] = rng() % 3 ? uint8_t(rng()) : frame;
        std::vector<unsigned char> part = whole;
        const int passes = 1 + int(rng() % 6);
        ASSERT_TRUE(GlowBoxFilter(whole.data(), passes, w, h, nullptr));
        ASSERT_TRUE(GlowBoxFilter(part.data(), passes, w, h, nullptr, content));
        ASSERT_EQ(part, whole) << "trial " << trial;
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
        EXPECT_TRUE(LayerCanvas(9, 9).Glyph(3, 3, 6, 6).Run(*Glow(size, kRed)).Untouched()) << size;
    EXPECT_EQ(Glow(2.4f, kRed)->getOffset(), 2);
    EXPECT_EQ(Glow(2.5f, kRed)->getOffset(), 3);
}

TEST(OuterGlow, KeepsItsOwnStops) {
    auto* stops = new GxGradient[2]{Stop(kRed, 0), Stop(0xFF0000FFu, 1)};
    GxOuterGlowProperty record(3.0f, kWhite, 1.0f, 2, stops);
    GxOuterGlow glow;
    glow.setProperty(&record);
    glow.setProperty(nullptr);
    LayerCanvas before(20, 20);
    before.Glyph(8, 8, 12, 12).Run(glow);
    delete[] stops;
    record.stops = nullptr;
    LayerCanvas after(20, 20);
    after.Glyph(8, 8, 12, 12).Run(glow);
    EXPECT_TRUE(after.SameAs(before));
    EXPECT_GT(after.At(12, 10)[0], after.At(12, 10)[2]);  // red at the edge
}

TEST(OuterGlow, Size100IsSymmetricAndFadesOutward) {
    LayerCanvas c(12 + 200, 8 + 200);  // the margin of 100 on every side
    auto glow = Glow(100.0f, kRed);
    EXPECT_EQ(glow->getOffset(), 100);
    c.Glyph(100, 100, 112, 108).Run(*glow);
    EXPECT_TRUE(c.Symmetric());
    EXPECT_GT(c.Alpha(112, 104), 0);
    for (int x = 112; x + 1 < 212; ++x) ASSERT_GE(c.Alpha(x, 104), c.Alpha(x + 1, 104)) << x;
}

TEST(OuterGlow, BoxesAndImagesOffTheCanvasAreClipped) {
    auto glow = Glow(6.0f, kRed);
    LayerCanvas exact(10, 10), hanging(10, 10);
    exact.Glyph(6, 6, 10, 10).Run(*glow);
    hanging.Glyph(6, 6, 10, 10).box = GxRect(6, 6, 40, 40);
    EXPECT_TRUE(hanging.Run(*glow).SameAs(exact));
    LayerCanvas away(10, 10);
    away.box = GxRect(20, 20, 30, 30);
    EXPECT_TRUE(away.Run(*glow).Untouched());
    // A destination smaller than the glow image.
    GxBitmap tiny(2, 2, 4);
    GxECore::ParamPostProcessing pp{&tiny, &exact.mask, &exact.box, 0, nullptr};
    glow->doPostProcessing(&pp);
    glow->doPostProcessing(nullptr);
}

}  // namespace
}  // namespace Glimmer
