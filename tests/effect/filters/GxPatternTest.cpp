// The pattern fill: bilinear samples by hand (the 65536 divisor, the wrap
// at the tile's end), then tiling, the layer's own tile copy and the edges.

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <memory>
#include <vector>

#include "effect/filters/GxPattern.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Px;

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
}

TEST(Pattern, TilesRepeatFromTheBoxCorner) {
    std::vector<std::array<uint8_t, 4>> texels;
    for (int i = 0; i < 6; ++i) texels.push_back({uint8_t(255 - i * 20), uint8_t(i * 40), uint8_t(7 * i), 90});
    GxBitmap tile = Tile(3, 2, texels);
    LayerCanvas c(20, 12);
    c.Glyph(2, 1, 20, 12).Run(*Pattern(&tile, 1.0f));
    for (int y = 1; y + 2 < 12; ++y)
        for (int x = 2; x + 3 < 20; ++x) {
            ASSERT_EQ(c.At(x, y), c.At(x + 3, y)) << x << "," << y;
            ASSERT_EQ(c.At(x, y), c.At(x, y + 2)) << x << "," << y;
        }
    EXPECT_EQ(c.At(2, 1), (Px{0, 0, 88, 253}));  // texel 0 starts at the box corner
    EXPECT_EQ(c.At(1, 1), (Px{0, 0, 0, 0}));
}

TEST(Pattern, KeepsItsOwnCopyOfTheTile) {
    auto* tile = new GxBitmap(RedBlue());
    GxPatternProperty record(tile, 1.0f, 1.0f);
    GxPattern layer;
    layer.setProperty(&record);
    EXPECT_NE(static_cast<GxPatternProperty*>(layer.getProperty())->tile, tile);
    std::memset(tile->pixels, 0, 8);
    delete tile;
    layer.setProperty(nullptr);
    EXPECT_EQ(LayerCanvas(1, 1).Glyph(0, 0, 1, 1).Run(layer).At(0, 0), (Px{196, 0, 0, 253}));
}

TEST(Pattern, ScaleEdgesAndUnusableTiles) {
    GxBitmap flat = Tile(10, 10, std::vector<std::array<uint8_t, 4>>(100, {255, 10, 20, 30}));
    LayerCanvas c(12, 12);
    EXPECT_TRUE(c.Glyph(0, 0, 12, 12).Run(*Pattern(&flat, 0.09f)).Untouched());
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
