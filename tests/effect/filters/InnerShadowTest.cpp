#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxInnerShadow.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using namespace Testing;

std::unique_ptr<GxInnerShadow> MakeShadow(float angle, float distance, float size) {
    auto shadow = std::make_unique<GxInnerShadow>();
    GxInnerShadowProperty record(angle, distance, size, kWhite, 1.0f);
    shadow->setProperty(&record);
    return shadow;
}

// The 4x4 block at (2, 2) of an 8x8 text box at (0, 0) in a 10x10 mask.
Rows Block(float angle, float distance, float size) {
    GxBitmap mask(10, 10, 1);
    FillRect(mask, 2, 2, 6, 6, 255);
    return Window(LayerAlpha(*MakeShadow(angle, distance, size), mask, GxRect(0, 0, 8, 8)), 10, 2, 2, 6, 6);
}

TEST(InnerShadowLayer, HandValues) {
    EXPECT_EQ(MakeShadow(45, 100, 100)->getOffset(), 0);
    EXPECT_EQ(GxInnerShadow().getStyle(), 2);
    // Unmoved and unblurred: 255 - coverage, on glyph pixels only.
    GxBitmap mask = MaskFromPicture({"......", ".##+#.", ".#9#..", "......"});
    EXPECT_EQ(Window(LayerAlpha(*MakeShadow(0, 0, 0), mask, GxRect(0, 0, 6, 4)), 6, 0, 0, 6, 4),
              (Rows{{0, 0, 0, 0, 0, 0}, {0, 0, 0, 127, 0, 0}, {0, 0, 246, 0, 0, 0}, {0, 0, 0, 0, 0, 0}}));
    // Size 1 (w = 100, 1, S = 102), moved down 2. Along the rows the inverse
    // is 255 outside the block, 2 on its edge columns, 0 inside; down the
    // moved columns, from the top: 255, 25755 / 102 = 252, then 255 / 102 = 2
    // (edge columns 457 / 102 = 4), then 0 (edge columns 204 / 102 = 2).
    EXPECT_EQ(Block(90, 2, 1), (Rows{{255, 255, 255, 255}, {252, 252, 252, 252}, {4, 2, 2, 4}, {2, 0, 0, 2}}));
}

TEST(InnerShadowLayer, ShadeLiesAlongTheEdgesTowardTheLight) {
    // The inverse moves as an outer shadow of the same angle would: down at
    // 90 (top rows shaded), right at 180 (left column shaded).
    const int F = 255;
    EXPECT_EQ(Block(90, 2, 0), (Rows{{F, F, F, F}, {F, F, F, F}, {0, 0, 0, 0}, {0, 0, 0, 0}}));
    EXPECT_EQ(Block(180, 1, 0), (Rows{{F, 0, 0, 0}, {F, 0, 0, 0}, {F, 0, 0, 0}, {F, 0, 0, 0}}));
}

TEST(InnerShadowLayer, FullDisplacementThresholds) {
    // Moved wholly off the 6x5 box the mask itself is drawn (its half pixel
    // at 128); just short of that every glyph pixel reads the uncovered fill
    // (255). Non-strict to the right and below, strict to the left and above.
    GxBitmap mask = MaskFromPicture({".####.", ".#+##.", ".####.", ".####.", "......"});
    auto halfPixel = [&](float angle, float distance) {
        return LayerAlpha(*MakeShadow(angle, distance, 0), mask, GxRect(0, 0, 6, 5))[8];
    };
    EXPECT_EQ(halfPixel(180, 6), 128);  // dx = 6 = W
    EXPECT_EQ(halfPixel(180, 5), 255);
    EXPECT_EQ(halfPixel(0, 6), 255);  // dx = -6: not yet
    EXPECT_EQ(halfPixel(0, 7), 128);
    EXPECT_EQ(halfPixel(90, 5), 128);  // dy = 5 = H
    EXPECT_EQ(halfPixel(90, 4), 255);
    EXPECT_EQ(halfPixel(270, 5), 255);  // dy = -5: not yet
    EXPECT_EQ(halfPixel(270, 6), 128);
    EXPECT_EQ(LayerAlpha(*MakeShadow(180, 60, 2), mask, GxRect(0, 0, 6, 5)), Bytes(mask));
}

TEST(InnerShadowLayer, NothingOutsideTheGlyphs) {
    // Whatever the light, size and distance (uncovered parts, full
    // displacement, the largest the stack asks for), the shade stays on
    // glyph pixels.
    std::mt19937 rng(5);
    GxBitmap mask(30, 20, 1);
    for (int i = 0; i < 200; ++i) mask.pixels[(2 + rng() % 16) * 30 + 3 + rng() % 24] = uint8_t(rng() % 256);
    FillRect(mask, 8, 5, 20, 12, 255);
    for (float angle : {0.0f, 37.0f, 90.0f, 150.0f, 225.0f, 300.0f}) {
        for (float distance : {0.0f, 1.0f, 4.0f, 9.0f, 23.0f, 100.0f}) {
            for (float size : {0.0f, 1.0f, 3.0f, 12.0f, 100.0f}) {
                std::vector<uint8_t> a = LayerAlpha(*MakeShadow(angle, distance, size), mask, GxRect(3, 2, 27, 18));
                for (size_t i = 0; i < a.size(); ++i) {
                    if (mask.pixels[i] == 0) {
                        ASSERT_EQ(a[i], 0) << angle << " " << distance << " " << size << " @" << i;
                    }
                }
            }
        }
    }
    // A 100 px blur 100 px away still shades the middle of a block nearly fully.
    EXPECT_GE(LayerAlpha(*MakeShadow(45, 100, 100), mask, GxRect(3, 2, 27, 18))[8 * 30 + 14], 250);
}

TEST(InnerShadowLayer, ExtremeAndBadInputsAreClean) {
    GxBitmap mask(24, 16, 1);
    FillRect(mask, 4, 3, 20, 13, 255);
    const GxRect rect(2, 1, 22, 15);
    EXPECT_EQ(LayerAlpha(*MakeShadow(0, 1e30f, 2), mask, rect), Bytes(mask));  // fully displaced
    const std::vector<uint8_t> nothing(24 * 16, 0);
    EXPECT_EQ(LayerAlpha(*MakeShadow(0, 0, 1e7f), mask, rect), nothing);  // refused size
    auto shadow = MakeShadow(0, 2, 1);
    EXPECT_TRUE(BadCallsDrawNothing(*shadow, mask, rect, GxRect(22, 1, 2, 15)));
    EXPECT_EQ(LayerAlpha(*shadow, mask, GxRect(2, -5, 22, 40)), LayerAlpha(*shadow, mask, GxRect(2, 0, 22, 16)));
}

}  // namespace
}  // namespace Glimmer
