#pragma once
// Pattern fill (kind 11): the glyphs filled with a tiled, scaled image.
//
// The tile is scaled by `scale` (tiles of trunc(scale * width) by
// trunc(scale * height) pixels) and repeated from the glyph box's top-left
// corner. Each output pixel under the mask samples the tile bilinearly at
// ((x mod tw) / scale, (y mod th) / scale); the right and bottom neighbours
// of the last texel of a tile are the first texels of the next (the tile
// wraps). The weights are 8-bit, fx = trunc(frac * 255), and a byte mixes as
//     ((b00 (255 - fx) + b10 fx) (255 - fy) + (b01 (255 - fx) + b11 fx) fy) >> 16
// The divisor is 65536, not 255 * 255, so a texel taken at full weight
// loses a little (255 becomes 253): deliberate, kept.
//
// Tile pixels are bytes A, R, G, B. The output alpha is trunc(opacity * A)
// and each colour channel is premultiplied by it, ((c + 1) * alpha) >> 8;
// pixels outside the mask stay transparent. The image goes to the target
// destination-over at the box's top-left corner.
//
// The layer owns a copy of the tile, made when the property is set, so the
// caller may free or change its own bitmap at any time.

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "foundation/GxBitmap.h"

namespace Glimmer {

class GxPattern : public GxECoreBase {
public:
    GxPattern();
    ~GxPattern() override;

    // Keeps its own record whose tile is the layer's own copy.
    void setProperty(GxProperty* p) override;
    GxProperty* getProperty() override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;

private:
    GxPatternProperty* property = nullptr;
    GxBitmap* tile = nullptr;  // owned; property->tile points here
};

}  // namespace Glimmer
