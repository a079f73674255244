// The gradient colour table and the linear gradient fill.

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "effect/filters/GxColorRamp.h"
#include "effect/filters/GxLinearGradient.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;
using Testing::Stop;

constexpr uint32_t kBlack = 0xFF000000u, kWhite = 0xFFFFFFFFu;
const std::vector<GxGradient> kBlackToWhite{Stop(kBlack, 0.0f), Stop(kWhite, 1.0f)};

std::unique_ptr<GxLinearGradient> Linear(float angle, float scale, std::vector<GxGradient> stops) {
    auto layer = std::make_unique<GxLinearGradient>();
    GxLinearGradientProperty record(angle, scale, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    layer->setProperty(&record);
    return layer;
}

TEST(GradientTable, RampStartsAtTheFirstStopsPosition) {
    std::vector<GxGradient> stops{Stop(kBlack, 0.5f), Stop(kWhite, 1.0f)};
    uint32_t table[257];
    ASSERT_TRUE(BuildGradientTable(table, stops.data(), 2));
    EXPECT_EQ(table[128], kBlack);  // t = 0.5: the ramp starts here
    EXPECT_EQ(table[192], 0xFF7F7F7Fu);
    EXPECT_EQ(table[256], kWhite);
    ASSERT_TRUE(BuildGradientTable(table, stops.data(), 1));
    EXPECT_EQ(table[256], kBlack);
    EXPECT_FALSE(BuildGradientTable(table, nullptr, 3));
}

TEST(LinearGradient, TwoHundredWideBoxAtAngleZero) {
    // L = 200, k = 1.28: column 0 takes entry 0, column 100 entry 128,
    // column 199 entry 254; entry i of black-to-white is (255 * i) >> 8.
    LayerCanvas c(200, 3);
    c.Glyph(0, 0, 200, 3).Run(*Linear(0.0f, 1.0f, kBlackToWhite));
    EXPECT_EQ(c.At(0, 1), (Px{0, 0, 0, 255}));
    EXPECT_EQ(c.At(100, 1), (Px{127, 127, 127, 255}));
    EXPECT_EQ(c.At(199, 1), (Px{253, 253, 253, 255}));
    for (int x = 0; x + 1 < 200; ++x) ASSERT_LE(c.At(x, 1)[0], c.At(x + 1, 1)[0]) << x;
    EXPECT_EQ(c.At(50, 0), c.At(50, 2));
    // Scale 2: the table spans 400 pixels, the box sees entries 64..191.
    LayerCanvas wide(200, 1);
    wide.Glyph(0, 0, 200, 1).Run(*Linear(0.0f, 2.0f, kBlackToWhite));
    EXPECT_EQ(wide.At(0, 0)[0], 63);
    EXPECT_EQ(wide.At(199, 0)[0], 190);
}

TEST(LinearGradient, AngleTurnsAgainstTheClock) {
    LayerCanvas up(6, 40), left(40, 6);  // 90: upwards; 180: leftwards
    up.Glyph(0, 0, 6, 40).Run(*Linear(90.0f, 1.0f, kBlackToWhite));
    left.Glyph(0, 0, 40, 6).Run(*Linear(180.0f, 1.0f, kBlackToWhite));
    EXPECT_GT(up.At(3, 0)[0], 240);
    EXPECT_LT(up.At(3, 39)[0], 15);
    for (int i = 0; i + 1 < 40; ++i) {
        ASSERT_GE(up.At(3, i)[0], up.At(3, i + 1)[0]) << i;
        ASSERT_GE(left.At(i, 3)[0], left.At(i + 1, 3)[0]) << i;
    }
}

TEST(LinearGradient, MaskGatesWithoutScalingDestinationOver) {
    LayerCanvas c(4, 1);
    c.Glyph(0, 0, 4, 1);
    c.mask.pixels[1] = 0;
    c.mask.pixels[2] = 1;  // barely covered: still the full colour
    for (int i = 0; i < 4; ++i) c.dst.pixels[12 + i] = i == 3 ? 255 : 200;  // opaque pixel 3 stays
    c.Run(*Linear(0.0f, 1.0f, {Stop(0x80FF0000u, 0.0f)}));
    EXPECT_EQ(c.At(0, 0), (Px{128, 0, 0, 128}));  // (255 + 1) * 128 >> 8
    EXPECT_EQ(c.At(1, 0), (Px{0, 0, 0, 0}));
    EXPECT_EQ(c.At(2, 0), (Px{128, 0, 0, 128}));
    EXPECT_EQ(c.At(3, 0), (Px{200, 200, 200, 255}));
}

TEST(LinearGradient, NothingWithoutStopsOrBelowATenth) {
    LayerCanvas c(8, 8);
    c.Glyph(0, 0, 8, 8).Run(*Linear(0.0f, 1.0f, {})).Run(*Linear(0.0f, 0.09f, kBlackToWhite));
    GxLinearGradientProperty nullStops(0.0f, 1.0f, 1.0f, 2, nullptr);
    GxLinearGradient layer;
    layer.setProperty(&nullStops);
    EXPECT_TRUE(c.Run(layer).Untouched());
    EXPECT_FALSE(c.Run(*Linear(0.0f, 0.1f, kBlackToWhite)).Untouched());
}

}  // namespace
}  // namespace Glimmer
