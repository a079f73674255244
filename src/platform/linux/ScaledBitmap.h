#pragma once
// Drawing a glyph image (a coverage bitmap at a strike's size) into a mask
// at any size, stretch and slant, as outlines are drawn.

#include <cstdint>

#include "platform/TextLayout.h"
#include "platform/linux/FontLinux.h"

namespace Glimmer::Platform {

// Where the image goes: the glyph origin in the mask (y down), pixels per
// strike pixel, the run's horizontal stretch, and its slant (x += skewX * y,
// y down from the origin).
struct BitmapPlacement {
    float originX = 0.0f;
    float originY = 0.0f;
    float scale = 1.0f;
    float scaleX = 1.0f;
    float skewX = 0.0f;
};

// The whole pixels the scaled image may cover, relative to the origin when
// it is whole; empty when nothing would be drawn.
LayoutRect ScaledBitmapBounds(const StrikeGlyph& glyph, const BitmapPlacement& placement);

// Blends the scaled image's coverage over the width x height mask (source
// over), touching nothing outside it. Without anti-aliasing a pixel is on
// at half coverage or more.
void DrawScaledBitmap(const StrikeGlyph& glyph, const BitmapPlacement& placement, bool antiAlias, uint8_t* mask,
                      int width, int height);

// round(x / 255) for 0 <= x <= 255 * 255.
inline uint32_t Div255(uint32_t x) {
    x += 128;
    return (x + (x >> 8)) >> 8;
}

// Coverage s over coverage d: s + d - s * d / 255, rounded.
inline uint8_t CoverageOver(uint32_t s, uint32_t d) { return uint8_t(s + d - Div255(s * d)); }

}  // namespace Glimmer::Platform
