// The fills: the gradient colour table, the linear and radial gradients and
// the pattern, by hand on small boxes, with their refusals.

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "effect/filters/GxColorRamp.h"
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

std::unique_ptr<GxLinearGradient> Linear(float angle, float scale, std::vector<GxGradient> stops = kBlackToWhite) {
    auto layer = std::make_unique<GxLinearGradient>();
    GxLinearGradientProperty record(angle, scale, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    layer->setProperty(&record);
    return layer;
}

std::unique_ptr<GxRadialGradient> Radial(float scale, std::vector<GxGradient> stops = kBlackToWhite) {
    auto layer = std::make_unique<GxRadialGradient>();
    GxRadialGradientProperty record(0.0f, scale, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    layer->setProperty(&record);
    return layer;
}

TEST(GradientTable, RampStartsAtTheFirstStopsPosition) {
    std::vector<GxGradient> stops{Stop(kBlack, 0.5f), Stop(kWhite, 1.0f)};
    uint32_t table[257];
    ASSERT_TRUE(BuildGradientTable(table, stops.data(), 2));
    EXPECT_EQ(table[128], kBlack);
    EXPECT_EQ(table[192], 0xFF7F7F7Fu) << "halfway between the stops";
    EXPECT_EQ(table[256], kWhite);
    ASSERT_TRUE(BuildGradientTable(table, stops.data(), 1));
    EXPECT_EQ(table[256], kBlack);
    EXPECT_FALSE(BuildGradientTable(table, nullptr, 3));
}

TEST(LinearGradient, AlongTheAngleByHand) {
    // L = 200, k = 1.28: column 0 takes entry 0, column 100 entry 128,
    // column 199 entry 254; entry i of black-to-white is (255 * i) >> 8.
    LayerCanvas c(200, 3);
    c.Glyph(0, 0, 200, 3).Run(*Linear(0.0f, 1.0f));
    EXPECT_EQ(c.At(0, 1), (Px{0, 0, 0, 255}));
    EXPECT_EQ(c.At(100, 1), (Px{127, 127, 127, 255}));
    EXPECT_EQ(c.At(199, 1), (Px{253, 253, 253, 255}));
    EXPECT_EQ(c.At(50, 0), c.At(50, 2));
    // Scale 2: the table spans 400 pixels, the box sees entries 64..191.
    LayerCanvas wide(200, 1);
    wide.Glyph(0, 0, 200, 1).Run(*Linear(0.0f, 2.0f));
    EXPECT_TRUE(wide.At(0, 0)[0] == 63 && wide.At(199, 0)[0] == 190);
    // The angle turns against the clock: 90 runs upwards.
    LayerCanvas up(6, 40);
    up.Glyph(0, 0, 6, 40).Run(*Linear(90.0f, 1.0f));
    EXPECT_TRUE(up.At(3, 0)[0] > 240 && up.At(3, 39)[0] < 15) << "angle 90 must run from the bottom up";
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

TEST(RadialGradient, RingsByHandOnAnEightWideBox) {
    // 512 / 8 / 1 = 64 entries per pixel of distance from (4, 4); a step down
    // counts as much as a step across, whatever the box's height.
    LayerCanvas c(8, 16);
    c.Glyph(0, 0, 8, 16).Run(*Radial(1.0f));
    EXPECT_EQ(c.At(4, 8), (Px{0, 0, 0, 255}));
    EXPECT_EQ(c.At(5, 8), (Px{63, 63, 63, 255}));     // entry 64
    EXPECT_EQ(c.At(5, 9), (Px{89, 89, 89, 255}));     // trunc(64 * sqrt 2) = 90
    EXPECT_EQ(c.At(0, 8), (Px{254, 254, 254, 255}));  // 256, held at 255
    for (int k = 0; k < 4; ++k) EXPECT_EQ(c.At(4, 8 + k), c.At(4 + k, 8)) << k;
    LayerCanvas wide(8, 8);
    EXPECT_EQ(wide.Glyph(0, 0, 8, 8).Run(*Radial(2.0f)).At(5, 4)[0], 31);  // entry 32
}

TEST(GradientFills, NothingWithoutStopsOrBelowATenthAndHolesStayClear) {
    LayerCanvas c(8, 8);
    c.Glyph(0, 0, 8, 8).Run(*Linear(0.0f, 1.0f, {})).Run(*Linear(0.0f, 0.09f)).Run(*Radial(1.0f, {})).Run(*Radial(0.09f));
    GxLinearGradientProperty nullStops(0.0f, 1.0f, 1.0f, 2, nullptr);
    GxLinearGradient layer;
    layer.setProperty(&nullStops);
    EXPECT_TRUE(c.Run(layer).Untouched()) << "a gradient without stops or below scale 0.1 drew";
    c.mask.pixels[3 * 8 + 3] = 0;
    c.Run(*Radial(0.1f));
    EXPECT_EQ(c.At(3, 3), (Px{0, 0, 0, 0}));
    EXPECT_EQ(c.Alpha(4, 3), 255);
}

// --- the pattern

// A tile from texels given as bytes A, R, G, B.
GxBitmap Tile(int w, int h, const std::vector<std::array<uint8_t, 4>>& texels) {
    GxBitmap tile(w, h, 4);
    for (size_t i = 0; i < texels.size(); ++i) std::memcpy(tile.pixels + i * 4, texels[i].data(), 4);
    return tile;
}

std::unique_ptr<GxPattern> Pattern(GxBitmap* tile, float scale, float opacity = 1.0f) {
    auto layer = std::make_unique<GxPattern>();
    GxPatternProperty record(tile, scale, opacity);
    layer->setProperty(&record);
    return layer;
}

GxBitmap RedBlue() { return Tile(2, 1, {{255, 200, 0, 0}, {255, 0, 0, 100}}); }  // opaque red 200, blue 100

TEST(Pattern, BilinearSamplesByHand) {
    GxBitmap tile = RedBlue();
    // Scale 1: whole texels, which lose a little to the divisor: alpha
    // 255 * 255 * 255 >> 16 = 253, red 200 -> 198 -> (199 * 253) >> 8 = 196.
    LayerCanvas c(4, 2);
    c.Glyph(0, 0, 4, 2).Run(*Pattern(&tile, 1.0f));
    EXPECT_EQ(c.At(0, 0), (Px{196, 0, 0, 253}));
    EXPECT_EQ(c.At(1, 0), (Px{0, 0, 98, 253}));
    EXPECT_EQ(c.At(2, 1), (Px{196, 0, 0, 253}));  // the tile repeats
    // Scale 2: odd columns halfway, fx = 127; column 3 mixes the last texel
    // with the first of the next tile.
    LayerCanvas half(4, 1);
    half.Glyph(0, 0, 4, 1).Run(*Pattern(&tile, 2.0f));
    EXPECT_EQ(half.At(1, 0), (Px{98, 0, 49, 253}));
    EXPECT_EQ(half.At(3, 0), (Px{97, 0, 49, 253}));
    // Opacity 0.5: alpha trunc(0.5 * 253) = 126, red (199 * 126) >> 8 = 97.
    EXPECT_EQ(LayerCanvas(1, 1).Glyph(0, 0, 1, 1).Run(*Pattern(&tile, 1.0f, 0.5f)).At(0, 0), (Px{97, 0, 0, 126}));
    // Tiles start at the box corner.
    LayerCanvas corner(4, 2);
    EXPECT_EQ(corner.Glyph(1, 1, 4, 2).Run(*Pattern(&tile, 1.0f)).At(1, 1), (Px{196, 0, 0, 253}));
}

TEST(Pattern, KeepsItsOwnTileAndRefusesUnusableOnes) {
    auto* tile = new GxBitmap(RedBlue());
    GxPatternProperty record(tile, 1.0f, 1.0f);
    GxPattern layer;
    layer.setProperty(&record);
    std::memset(tile->pixels, 0, 8);
    delete tile;
    EXPECT_EQ(LayerCanvas(1, 1).Glyph(0, 0, 1, 1).Run(layer).At(0, 0), (Px{196, 0, 0, 253}))
        << "the pattern read the caller's tile after it was freed";

    GxBitmap flat = Tile(10, 10, std::vector<std::array<uint8_t, 4>>(100, {255, 10, 20, 30}));
    LayerCanvas c(12, 12);
    EXPECT_TRUE(c.Glyph(0, 0, 12, 12).Run(*Pattern(&flat, 0.09f)).Untouched()) << "a scale below 0.1 drew";
    EXPECT_EQ(c.Run(*Pattern(&flat, 0.1f)).At(11, 11), (Px{9, 19, 29, 253}));
    // A tile scaled below one pixel still samples inside the tile.
    GxBitmap dot = Tile(1, 1, {{255, 255, 255, 255}});
    EXPECT_EQ(LayerCanvas(9, 9).Glyph(0, 0, 9, 9).Run(*Pattern(&dot, 0.5f)).Alpha(8, 8), 253);
    // No tile, an 8-bit tile, a box off the mask: nothing.
    GxBitmap gray(4, 4, 1);
    LayerCanvas none(6, 6);
    none.Glyph(0, 0, 6, 6).Run(*Pattern(nullptr, 1.0f)).Run(*Pattern(&gray, 1.0f));
    none.box = GxRect(6, 0, 9, 6);
    EXPECT_TRUE(none.Run(*Pattern(&flat, 1.0f)).Untouched());
}

}  // namespace
}  // namespace Glimmer
