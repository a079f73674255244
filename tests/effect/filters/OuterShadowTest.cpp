#include <gtest/gtest.h>

#include <cmath>
#include <memory>
#include <vector>

#include "effect/filters/GxOuterShadow.h"
#include "effect/filters/GxShadowGeometry.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using namespace Testing;

std::unique_ptr<GxOuterShadow> MakeShadow(float angle, float distance, float size, unsigned color = kWhite) {
    auto shadow = std::make_unique<GxOuterShadow>();
    GxOuterShadowProperty record(angle, distance, size, color, 1.0f);
    shadow->setProperty(&record);
    return shadow;
}

// left, right, top, bottom
std::vector<int> Margins(const std::unique_ptr<GxOuterShadow>& s) {
    return {s->getLeftOffset(), s->getRightOffset(), s->getTopOffset(), s->getBottomOffset()};
}

TEST(ShadowGeometry, DisplacementAndRadius) {
    auto at = [](float angle, float distance) {
        ShadowDisplacement d = ComputeShadowDisplacement(angle, distance);
        return std::vector<int>{d.dx, d.dy};
    };
    EXPECT_EQ(at(0, 5), (std::vector<int>{-5, 0}));
    EXPECT_EQ(at(90, 2.5f), (std::vector<int>{0, 3}));  // cos(90 deg via 3.14159) ~ 0 rounds to 0
    EXPECT_EQ(at(180, 4), (std::vector<int>{4, 0}));
    EXPECT_EQ(at(45, 10), (std::vector<int>{-7, 7}));
    EXPECT_EQ(at(0, 1e30f)[0], -(1 << 30));  // clamped, not undefined
    EXPECT_EQ(ShadowRadiusDouble(-3.0f), 0);
    // 0.49999997 + 0.5 rounds up to 1 in single precision, not in double.
    EXPECT_EQ(ShadowRadiusSingle(0.49999997f), 1);
    EXPECT_EQ(ShadowRadiusDouble(0.49999997f), 0);
}

TEST(OuterShadowLayer, MarginsFollowTheDisplacement) {
    auto unset = std::make_unique<GxOuterShadow>();
    EXPECT_EQ(Margins(unset), (std::vector<int>{0, 0, 0, 0}));
    EXPECT_EQ(unset->getStyle(), 1);
    EXPECT_EQ(Margins(MakeShadow(0, 5, 2)), (std::vector<int>{7, 0, 2, 2}));
    EXPECT_EQ(Margins(MakeShadow(90, 2.5f, 2)), (std::vector<int>{2, 2, 0, 5}));
    EXPECT_EQ(Margins(MakeShadow(270, 4, -10)), (std::vector<int>{0, 0, 4, 0}));
    EXPECT_EQ(Margins(MakeShadow(0, 100, 100)), (std::vector<int>{200, 0, 100, 100}));
    EXPECT_EQ(Margins(MakeShadow(0, 5, 1e9f)), (std::vector<int>{0, 0, 0, 0}));  // refused size
    // A new record moves the shadow; a null one changes nothing.
    auto shadow = MakeShadow(0, 5, 2);
    GxOuterShadowProperty down(90, 4, 2, kWhite, 1.0f);
    shadow->setProperty(&down);
    shadow->setProperty(nullptr);
    EXPECT_EQ(Margins(shadow), (std::vector<int>{2, 2, 0, 6}));
}

TEST(OuterShadowLayer, NoBlurNoDistanceIsTheMaskInTheShadowColour) {
    GxBitmap mask = MaskFromPicture({"..........", "..##+.....", "..#+#..1..", "..###.....", ".........."});
    GxBitmap dst(10, 5, 4);
    RunLayer(*MakeShadow(30, 0, 0, 0xFF336699u), mask, dst, GxRect(1, 1, 8, 4));
    const unsigned channel[4] = {0x33, 0x66, 0x99, 0xFF};  // memory order R, G, B, A
    for (size_t i = 0; i < 50; ++i)
        for (int c = 0; c < 4; ++c) ASSERT_EQ(dst.pixels[i * 4 + c], ((channel[c] + 1) * mask.pixels[i]) >> 8) << i;
}

TEST(OuterShadowLayer, HandValues) {
    // Size 0.4: R = 0, the mask only moves (left by 3 at angle 0).
    GxBitmap mask = MaskFromPicture({"..........", "......##+.", "......#+..", ".........."});
    std::vector<uint8_t> moved = LayerAlpha(*MakeShadow(0, 3, 0.4f), mask, GxRect(5, 1, 9, 3));
    EXPECT_EQ(Window(moved, 10, 0, 1, 10, 3), (Rows{{0, 0, 0, 255, 255, 128, 0, 0, 0, 0},
                                                   {0, 0, 0, 255, 128, 0, 0, 0, 0, 0}}));
    // Size 1: w = 100, 1 and S = 102. Down the columns one full pixel gives
    // 250 with 2 above and below; along the rows 250 gives 245 with 2 either
    // side, and each 2 gives 1: columns first, so not symmetric under
    // transposition.
    GxBitmap dot(9, 9, 1);
    FillRect(dot, 4, 4, 5, 5, 255);
    std::vector<uint8_t> a = LayerAlpha(*MakeShadow(0, 0, 1), dot, GxRect(4, 4, 5, 5));
    EXPECT_EQ(Window(a, 9, 2, 2, 7, 7), (Rows{{0, 0, 0, 0, 0}, {0, 0, 1, 0, 0}, {0, 2, 245, 2, 0},
                                             {0, 0, 1, 0, 0}, {0, 0, 0, 0, 0}}));
    EXPECT_EQ(std::count(a.begin(), a.end(), 0), 81 - 5);
}

TEST(OuterShadowLayer, OffCanvasAndExtremeInputsAreClean) {
    GxBitmap mask(24, 16, 1);
    FillRect(mask, 2, 4, 10, 12, 255);
    const GxRect rect(2, 4, 10, 12);
    const std::vector<uint8_t> nothing(24 * 16, 0);
    for (float angle : {0.0f, 90.0f, 180.0f, 270.0f})  // wholly beyond each edge
        EXPECT_EQ(LayerAlpha(*MakeShadow(angle, 100, 2), mask, rect), nothing) << angle;
    EXPECT_EQ(LayerAlpha(*MakeShadow(0, 0, 1e7f), mask, rect), nothing);
    EXPECT_EQ(LayerAlpha(*MakeShadow(45, 1e30f, 3), mask, rect), nothing);
    // The largest the stack asks for: a 100 px blur still reaches the
    // block's middle; 100 px away it is clipped.
    EXPECT_GT(LayerAlpha(*MakeShadow(0, 0, 100), mask, rect)[size_t(8) * 24 + 6], 0);
    LayerAlpha(*MakeShadow(180, 100, 100), mask, rect);
    EXPECT_TRUE(BadCallsDrawNothing(*MakeShadow(0, 0, 1), mask, rect, GxRect(12, 4, 2, 12)));
}

}  // namespace
}  // namespace Glimmer
