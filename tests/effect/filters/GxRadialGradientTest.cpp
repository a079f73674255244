// The radial gradient fill: ring distances by hand, then symmetry.

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "effect/filters/GxRadialGradient.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;
using Testing::Stop;

const std::vector<GxGradient> kBlackToWhite{Stop(0xFF000000u, 0.0f), Stop(0xFFFFFFFFu, 1.0f)};

std::unique_ptr<GxRadialGradient> Radial(float scale, std::vector<GxGradient> stops = kBlackToWhite) {
    auto layer = std::make_unique<GxRadialGradient>();
    GxRadialGradientProperty record(0.0f, scale, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    layer->setProperty(&record);
    return layer;
}

TEST(RadialGradient, RingsByHandOnAnEightWideBox) {
    // 512 / 8 / 1 = 64 entries per pixel of distance from (4, 4).
    LayerCanvas c(8, 8);
    c.Glyph(0, 0, 8, 8).Run(*Radial(1.0f));
    EXPECT_EQ(c.At(4, 4), (Px{0, 0, 0, 255}));
    EXPECT_EQ(c.At(5, 4), (Px{63, 63, 63, 255}));     // entry 64
    EXPECT_EQ(c.At(5, 5), (Px{89, 89, 89, 255}));     // trunc(64 * sqrt 2) = 90
    EXPECT_EQ(c.At(0, 4), (Px{254, 254, 254, 255}));  // 256, held at 255
    LayerCanvas wide(8, 8);
    EXPECT_EQ(wide.Glyph(0, 0, 8, 8).Run(*Radial(2.0f)).At(5, 4)[0], 31);  // entry 32
}

TEST(RadialGradient, SymmetricAndSpacedByTheWidthOnly) {
    LayerCanvas c(31, 31);
    c.Glyph(0, 0, 31, 31).Run(*Radial(1.0f, {Stop(0xFFFF0000u, 0), Stop(0xFF00FF00u, 0.4f), Stop(0x800000FFu, 1)}));
    for (int y = 1; y < 31; ++y)  // centre 15.5: x mirrors to 31 - x
        for (int x = 1; x < 31; ++x) {
            ASSERT_EQ(c.At(x, y), c.At(31 - x, y)) << x << "," << y;
            ASSERT_EQ(c.At(x, y), c.At(y, x)) << x << "," << y;
        }
    // A tall box: a step down counts as much as a step across.
    LayerCanvas tall(8, 16);
    tall.Glyph(0, 0, 8, 16).Run(*Radial(1.0f));
    for (int k = 0; k < 4; ++k) EXPECT_EQ(tall.At(4, 8 + k), tall.At(4 + k, 8)) << k;
}

TEST(RadialGradient, NothingWithoutStopsOrBelowATenthAndHolesStayClear) {
    LayerCanvas c(8, 8);
    EXPECT_TRUE(c.Glyph(0, 0, 8, 8).Run(*Radial(1.0f, {})).Run(*Radial(0.09f)).Untouched());
    c.mask.pixels[3 * 8 + 3] = 0;
    c.Run(*Radial(0.1f));
    EXPECT_EQ(c.At(3, 3), (Px{0, 0, 0, 0}));
    EXPECT_EQ(c.Alpha(4, 3), 255);
}

}  // namespace
}  // namespace Glimmer
