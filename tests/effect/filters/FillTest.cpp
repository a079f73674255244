// The fills: what the gradients and the pattern refuse, and the pattern's
// own copy of its tile. Their pixels are pinned by the picture table.

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "effect/filters/GxLinearGradient.h"
#include "effect/filters/GxPattern.h"
#include "effect/filters/GxRadialGradient.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;
using Testing::Stop;

constexpr uint32_t kBlack = 0xFF000000u, kWhite = 0xFFFFFFFFu;
const std::vector<GxGradient> kBlackToWhite{Stop(kBlack, 0.0f), Stop(kWhite, 1.0f)};

template <typename Layer, typename Record>
std::unique_ptr<Layer> Gradient(float scale, std::vector<GxGradient> stops = kBlackToWhite) {
    auto layer = std::make_unique<Layer>();
    Record record(0.0f, scale, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    layer->setProperty(&record);
    return layer;
}
const auto Linear = Gradient<GxLinearGradient, GxLinearGradientProperty>;
const auto Radial = Gradient<GxRadialGradient, GxRadialGradientProperty>;

TEST(GradientFills, NothingWithoutStopsOrBelowATenthAndHolesStayClear) {
    LayerCanvas c(8, 8);
    c.Glyph(0, 0, 8, 8).Run(*Linear(1.0f, {})).Run(*Linear(0.09f, kBlackToWhite));
    c.Run(*Radial(1.0f, {})).Run(*Radial(0.09f, kBlackToWhite));
    GxLinearGradientProperty nullStops(0.0f, 1.0f, 1.0f, 2, nullptr);
    GxLinearGradient layer;
    layer.setProperty(&nullStops);
    EXPECT_TRUE(c.Run(layer).Untouched()) << "a gradient without stops or below scale 0.1 drew";
    c.mask.pixels[3 * 8 + 3] = 0;
    c.Run(*Radial(0.1f, kBlackToWhite));
    EXPECT_EQ(c.At(3, 3), (Px{0, 0, 0, 0}));
    EXPECT_EQ(c.At(4, 3)[3], 255);
}

// --- the pattern

std::unique_ptr<GxPattern> Pattern(GxBitmap* tile, float scale) {
    auto layer = std::make_unique<GxPattern>();
    GxPatternProperty record(tile, scale, 1.0f);
    layer->setProperty(&record);
    return layer;
}

TEST(Pattern, KeepsItsOwnTileAndRefusesUnusableOnes) {
    GxBitmap flat(10, 10, 4);
    for (size_t i = 0; i < 100; ++i) std::memcpy(flat.pixels + 4 * i, "\xFF\x0A\x14\x1E", 4);  // A, R, G, B
    auto* copied = new GxBitmap(flat);
    auto layer = Pattern(copied, 1.0f);
    std::memset(copied->pixels, 0, 400);
    delete copied;
    EXPECT_EQ(LayerCanvas(12, 12).Glyph(0, 0, 12, 12).Run(*layer).At(11, 11), (Px{9, 19, 29, 253}))
        << "the pattern must draw from its own copy of the tile";
    LayerCanvas c(12, 12);
    EXPECT_TRUE(c.Glyph(0, 0, 12, 12).Run(*Pattern(&flat, 0.09f)).Untouched()) << "a scale below 0.1 drew";
    EXPECT_EQ(c.Run(*Pattern(&flat, 0.1f)).At(11, 11), (Px{9, 19, 29, 253}));
    // A tile scaled below one pixel still samples inside the tile.
    GxBitmap dot(1, 1, 4);
    std::memset(dot.pixels, 255, 4);
    EXPECT_EQ(LayerCanvas(9, 9).Glyph(0, 0, 9, 9).Run(*Pattern(&dot, 0.5f)).At(8, 8)[3], 253);
    // No tile, an 8-bit tile, a box off the mask: nothing.
    GxBitmap gray(4, 4, 1);
    LayerCanvas none(6, 6);
    none.Glyph(0, 0, 6, 6).Run(*Pattern(nullptr, 1.0f)).Run(*Pattern(&gray, 1.0f));
    none.box = GxRect(6, 0, 9, 6);
    EXPECT_TRUE(none.Run(*Pattern(&flat, 1.0f)).Untouched());
}

}  // namespace
}  // namespace Glimmer
