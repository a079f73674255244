// The inner glow: the inverted passes by hand on a small square, with the
// opaque white frame, then properties on larger glyphs.

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>

#include "effect/filters/GxInnerGlow.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;

std::unique_ptr<GxInnerGlow> Glow(float size, uint32_t color) {
    auto glow = std::make_unique<GxInnerGlow>();
    GxInnerGlowProperty record(size, color, 1.0f, 0, nullptr);
    glow->setProperty(&record);
    return glow;
}

TEST(InnerGlow, SquareAtSizeOneByHand) {
    // A 7 x 7 glyph, g = 2: the image is 15 x 15 at (0, 0). After one box
    // pass the inverted plane is 191 along the glyph's edge, 0 inside, 255
    // outside; Rg = 1, weights {128, 1}, S = 130.
    LayerCanvas c(15, 15);
    c.Glyph(4, 4, 11, 11).Run(*Glow(1.0f, 0xFFFF0000u));
    const Px white{255, 255, 255, 255}, red{255, 0, 0, 255}, clear{0, 0, 0, 0};
    // The frame the passes do not reach: opaque white, kept outside the glyph.
    for (int i = 0; i < 15; ++i) {
        EXPECT_EQ(c.At(i, 0), white);
        EXPECT_EQ(c.At(14, i), white);
    }
    EXPECT_EQ(c.At(1, 1), red);  // processed, outside: entry 1
    EXPECT_EQ(c.At(3, 7), red);  // entry 2
    EXPECT_EQ(c.At(7, 4), red);  // edge row: outside coverage 191, entry 65
    EXPECT_EQ(c.At(7, 5), (Px{1, 0, 0, 1}));  // outside coverage 2: entry 254, alpha 1
    // The passes truncate differently across and along: one column in is
    // already entry 255, alpha 0.
    EXPECT_EQ(c.At(5, 7), clear);
    EXPECT_EQ(c.At(7, 7), clear);
    for (float size : {0.0f, -1.5f, -3.0f})
        EXPECT_TRUE(LayerCanvas(15, 15).Glyph(4, 4, 11, 11).Run(*Glow(size, 0xFFFF0000u)).Untouched());
}

TEST(InnerGlow, FadesTowardsTheInteriorSymmetricallyUpToSize100) {
    LayerCanvas c(50, 50);
    c.Glyph(5, 5, 45, 45).Run(*Glow(5.0f, 0xFF00FF00u));
    EXPECT_TRUE(c.Symmetric());
    EXPECT_EQ(c.Alpha(5, 25), 255);
    EXPECT_EQ(c.Alpha(25, 25), 0);
    for (int x = 5; x < 25; ++x) ASSERT_GE(c.Alpha(x, 25), c.Alpha(x + 1, 25)) << x;
    LayerCanvas big(12 + 200, 8 + 200);
    big.Glyph(100, 100, 112, 108).Run(*Glow(100.0f, 0xFF0000FFu));
    EXPECT_TRUE(big.Symmetric());
    EXPECT_EQ(big.Alpha(106, 104), 255);  // a thin glyph glows right through
}

}  // namespace
}  // namespace Glimmer
