#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <vector>

#include "platform/Canvas.h"

namespace Glimmer::Platform {
namespace {

using Pixel = std::array<uint8_t, 4>;

struct Image {
    Image(int w, int h, Pixel fill) : width(w), bytes(size_t(w) * size_t(h) * 4) {
        for (int i = 0; i < w * h; ++i) std::copy(fill.begin(), fill.end(), bytes.begin() + i * 4);
    }
    Pixel At(int x, int y) const {
        const uint8_t* p = &bytes[(size_t(y) * size_t(width) + size_t(x)) * 4];
        return {p[0], p[1], p[2], p[3]};
    }
    int width;
    std::vector<uint8_t> bytes;
};

// Straight-alpha source-over, values worked out by hand.
TEST(CanvasTest, DrawImageBlendsStraightAlphaSourceOver) {
    const struct {
        Pixel dst, src, expected;
    } cases[] = {
        {{0, 0, 0, 255}, {200, 100, 50, 128}, {100, 50, 25, 255}},   // over opaque black
        {{9, 9, 9, 0}, {200, 100, 50, 128}, {200, 100, 50, 128}},    // over nothing
        {{0, 0, 255, 128}, {255, 0, 0, 128}, {170, 0, 85, 192}},     // half over half
        {{7, 8, 9, 10}, {200, 100, 50, 0}, {7, 8, 9, 10}},           // transparent source
        {{7, 8, 9, 10}, {200, 100, 50, 255}, {200, 100, 50, 255}},   // opaque source
    };
    for (const auto& c : cases) {
        Image dst(1, 1, c.dst);
        Image src(1, 1, c.src);
        Canvas(dst.bytes.data(), 1, 1).DrawImage(src.bytes.data(), 1, 1, 0, 0);
        EXPECT_EQ(dst.At(0, 0), c.expected);
    }
}

// The text object relies on this when there is no background: drawing a
// straight-colour picture whose transparent pixels are 0 (as the effect stack
// leaves it) onto a cleared canvas gives the picture itself inside the clip.
TEST(CanvasTest, DrawingOntoClearedPixelsEqualsClearingOutsideTheClip) {
    const int w = 64, h = 5;
    Image picture(w, h, {0, 0, 0, 0});
    uint32_t seed = 12345;
    for (uint8_t& byte : picture.bytes) byte = uint8_t((seed = seed * 1664525u + 1013904223u) >> 24);
    for (int i = 0; i < 256; ++i) picture.bytes[size_t(i) * 4 + 3] = uint8_t(i);   // every alpha
    for (int i = 0; i < w * h; ++i) {
        if (picture.bytes[size_t(i) * 4 + 3] == 0) std::fill_n(&picture.bytes[size_t(i) * 4], 3, 0);
    }
    Image drawn(w, h, {7, 7, 7, 7});
    Canvas onto(drawn.bytes.data(), w, h);
    onto.Clear();
    onto.ClipRect(3, 1, 60, 4);
    onto.DrawImage(picture.bytes.data(), w, h, 0, 0);

    Image kept = picture;
    Canvas in(kept.bytes.data(), w, h);
    in.ClipRect(3, 1, 60, 4);
    in.ClearOutsideClip();
    EXPECT_TRUE(drawn.bytes == kept.bytes) << "drawing onto cleared pixels changed the picture";
    EXPECT_EQ(kept.At(2, 2), (Pixel{0, 0, 0, 0}));
}

}  // namespace
}  // namespace Glimmer::Platform
