// The outer and inner shadow: their shared geometry and margins, the
// full-displacement thresholds, the shade staying on the glyphs whatever the
// parameters, and the edges. Their pixels are pinned by the picture table.

#include <gtest/gtest.h>

#include <array>
#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxInnerShadow.h"
#include "effect/filters/GxOuterShadow.h"
#include "effect/filters/GxShadowGeometry.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using namespace Testing;

template <typename Layer, typename Record>
std::unique_ptr<Layer> Make(float angle, float distance, float size) {
    auto shadow = std::make_unique<Layer>();
    Record record(angle, distance, size, kWhite, 1.0f);
    shadow->setProperty(&record);
    return shadow;
}
const auto Outer = Make<GxOuterShadow, GxOuterShadowProperty>;
const auto Inner = Make<GxInnerShadow, GxInnerShadowProperty>;

TEST(ShadowGeometry, DisplacementRadiusAndMargins) {
    EXPECT_EQ(ComputeShadowDisplacement(0, 1e30f).dx, -(1 << 30)) << "a huge distance must clamp, not overflow";
    EXPECT_EQ(ShadowRadiusDouble(-3.0f), 0);
    // 0.49999997 + 0.5 rounds up to 1 in single precision, not in double.
    EXPECT_EQ(ShadowRadiusSingle(0.49999997f), 1);
    EXPECT_EQ(ShadowRadiusDouble(0.49999997f), 0);

    // Outer shadow margins (left, right, top, bottom): the displacement (angle
    // 0 moves left, 90 down; cos 90 via 3.14159 rounds to 0) plus the radius.
    // The inner shadow has none.
    const struct { float angle, distance, size; std::vector<int> margins; } cases[] = {
        {0, 5, 2, {7, 0, 2, 2}},       {90, 2.5f, 2, {2, 2, 0, 5}},          {270, 4, -10, {0, 0, 4, 0}},
        {0, 100, 100, {200, 0, 100, 100}}, {0, 5, 1e9f, {0, 0, 0, 0}},  // a refused size
    };
    for (const auto& c : cases) {
        auto s = Outer(c.angle, c.distance, c.size);
        EXPECT_EQ((std::vector<int>{s->getLeftOffset(), s->getRightOffset(), s->getTopOffset(), s->getBottomOffset()}),
                  c.margins) << "angle " << c.angle << " distance " << c.distance << " size " << c.size;
    }
    EXPECT_EQ(GxOuterShadow().getLeftOffset(), 0);
    EXPECT_EQ(Inner(45, 100, 100)->getOffset(), 0);
}

TEST(OuterShadow, OffCanvasExtremeAndBadInputsAreClean) {
    GxBitmap mask(24, 16, 1);
    FillRect(mask, 2, 4, 10, 12, 255);
    const GxRect rect(2, 4, 10, 12);
    const std::vector<uint8_t> nothing(24 * 16, 0);
    // Wholly beyond each edge, a refused size, a distance no integer holds.
    for (auto [a, d, size] : std::vector<std::array<float, 3>>{
             {0, 100, 2}, {90, 100, 2}, {180, 100, 2}, {270, 100, 2}, {0, 0, 1e7f}, {45, 1e30f, 3}})
        EXPECT_EQ(LayerAlpha(*Outer(a, d, size), mask, rect), nothing)
            << "drew with angle " << a << ", distance " << d << ", size " << size;
    // The largest the stack asks for: a 100 px blur still reaches the block's middle.
    EXPECT_GT(LayerAlpha(*Outer(0, 0, 100), mask, rect)[size_t(8) * 24 + 6], 0);
    EXPECT_TRUE(BadCallsDrawNothing(*Outer(0, 0, 1), mask, rect, GxRect(12, 4, 2, 12)));
}

TEST(InnerShadow, FullDisplacementThresholds) {
    // Moved wholly off the 6x5 box the mask itself is drawn (its half pixel
    // at 128); just short of that every glyph pixel reads the uncovered fill
    // (255). Non-strict to the right and below, strict to the left and above.
    GxBitmap mask = MaskFromPicture({".####.", ".#+##.", ".####.", ".####.", "......"});
    const struct { float angle, distance; int half; } cases[] = {
        {180, 6, 128}, {180, 5, 255}, {0, 6, 255}, {0, 7, 128},  // dx = 6 = W; dx = -6 not yet
        {90, 5, 128},  {90, 4, 255},  {270, 5, 255}, {270, 6, 128},
    };
    for (const auto& c : cases)
        EXPECT_EQ(LayerAlpha(*Inner(c.angle, c.distance, 0), mask, GxRect(0, 0, 6, 5))[8], c.half)
            << "angle " << c.angle << " distance " << c.distance;
    const std::vector<uint8_t> coverage(mask.pixels, mask.pixels + 30);
    EXPECT_EQ(LayerAlpha(*Inner(180, 60, 2), mask, GxRect(0, 0, 6, 5)), coverage);
    EXPECT_EQ(LayerAlpha(*Inner(0, 1e30f, 2), mask, GxRect(0, 0, 6, 5)), coverage);
}

TEST(InnerShadow, NothingOutsideTheGlyphsAndBadInputsAreClean) {
    // Whatever the light, size and distance (uncovered parts, full
    // displacement, the largest the stack asks for), the shade stays on
    // glyph pixels.
    std::mt19937 rng(5);
    GxBitmap mask(30, 20, 1);
    for (int i = 0; i < 200; ++i) mask.pixels[(2 + rng() % 16) * 30 + 3 + rng() % 24] = uint8_t(rng() % 256);
    FillRect(mask, 8, 5, 20, 12, 255);
    const GxRect rect(3, 2, 27, 18);
    for (float angle : {0.0f, 37.0f, 90.0f, 150.0f, 225.0f, 300.0f})
        for (float distance : {0.0f, 1.0f, 4.0f, 9.0f, 23.0f, 100.0f})
            for (float size : {0.0f, 1.0f, 3.0f, 12.0f, 100.0f}) {
                std::vector<uint8_t> a = LayerAlpha(*Inner(angle, distance, size), mask, rect);
                for (size_t i = 0; i < a.size(); ++i)
                    ASSERT_TRUE(mask.pixels[i] != 0 || a[i] == 0)
                        << "shade off the glyphs at " << i << ": angle " << angle << " distance " << distance
                        << " size " << size;
            }
    // A 100 px blur 100 px away still shades the middle of a block nearly fully.
    EXPECT_GE(LayerAlpha(*Inner(45, 100, 100), mask, rect)[8 * 30 + 14], 250);
    EXPECT_EQ(LayerAlpha(*Inner(0, 0, 1e7f), mask, rect), std::vector<uint8_t>(30 * 20, 0)) << "a refused size drew";
    EXPECT_TRUE(BadCallsDrawNothing(*Inner(0, 2, 1), mask, rect, GxRect(27, 2, 3, 18)));
    EXPECT_EQ(LayerAlpha(*Inner(0, 2, 1), mask, GxRect(3, -5, 27, 40)),
              LayerAlpha(*Inner(0, 2, 1), mask, GxRect(3, 0, 27, 20))) << "a box past the mask must act as clipped";
}

}  // namespace
}  // namespace Glimmer
