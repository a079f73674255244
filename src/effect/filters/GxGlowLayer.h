#pragma once
// Glows: a soft coloured halo around the glyphs (outer glow) or along the
// inside of their edges (inner glow).
//
// Both glows turn the glyph coverage into a 32-bit colour image in the same
// passes; the inner glow runs them on the inverted mask, so that it grows
// from the outside into the glyphs.
//
// 1. Plan. With s = trunc(size) and g = s + 1, the work image is the glyph
//    box grown by 2g on every side (W = box width + 4g, H = box height + 4g).
//    The box filter runs max(trunc(0.475 g), 1) times, the Gaussian has the
//    radius Rg = trunc(0.9 g) with the glow's centre weight 128 and the
//    double-precision rounding of its weights.
// 2. Plane. An 8-bit plane of W x H holds the glyph box 2g pixels in from
//    every side. Outer glow: coverage on a frame of 0. Inner glow: 255 minus
//    coverage on a frame of 255, so everything outside the glyphs counts as
//    fully outside.
// 3. Spread. The box filter sums each 3 x 3 neighbourhood and divides by 4,
//    not 9 (capped at 255): every pass both widens and brightens the plane.
//    This is what makes the glow reach out (or in); it is deliberate. Each
//    pass also writes 0 into the first and last column of the rows it
//    rewrites, which only the inverted plane of the inner glow notices.
// 4. Blur and colour, per row y in [Rg, H - Rg): a vertical pass into a byte
//    row, then a horizontal pass (the shared row kernel of GxBlurRows), each
//    sample a weighted sum divided by the weight total S. The inner glow takes both passes as 255 minus the
//    blurred value: the vertical one gives the blurred inside coverage, the
//    horizontal one the blurred outside coverage. The result v picks
//    table[256 - v] of the 257-entry colour table, so full coverage takes the
//    edge colour (entry 1) and no coverage the transparent entry 256. Output
//    pixels are premultiplied 0xAARRGGBB words.
// 5. Frame. Everything the passes do not reach (the first and last Rg rows
//    and columns) is 0 for the outer glow and 0xFFFFFFFF for the inner glow.
//    The inner glow's opaque white frame is deliberate and is kept: it is
//    drawn destination-over like the rest of the image.
// 6. The image goes to the target destination-over at (left - 2g, top - 2g).
//
// The colour table (makeColorLUT) is the single colour of the glow, or a
// ramp over its stops measured from 0 at the glyph edge, faded out from 0.3
// of the way on and fully transparent at its far end; a size of exactly 0
// makes it all transparent.
//
// Deliberate details: only g = 0 (a size in (-2, -1]) draws nothing without
// computing, and its image would be fully transparent, so it is skipped
// outright. A negative g has no image at all and draws nothing.

#include <cstdint>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/GxScratch.h"
#include "foundation/GxRect.h"

namespace Glimmer {

class GxGlowLayer : public GxECoreBase {
public:
    ~GxGlowLayer() override;

    GxProperty* getProperty() override;
    // trunc(size + 0.5) on every side.
    int32_t getOffset() override;

    // Fills table[0..256] (see the top of this file). fadeStart is clamped to
    // 0.01..0.99; curve is a ColorRampCurve.
    void makeColorLUT(unsigned int* table, float fadeStart, int curve);
    // `iterations` passes of the 3 x 3 sum / 4 spread over a width x height
    // plane, in place.
    void increaseByBoxFilter(unsigned char* plane, int iterations, int width, int height);
    // weights[0..radius] with centre 128 and their total.
    void computeGaussianWeights(int* weights, int* sum, int radius);

protected:
    enum class Side { kOuter, kInner };

    GxGlowLayer() = default;
    // Takes `copy` (may be null) in place of the current record and gives it
    // its own stops; a copy that cannot get them is dropped.
    void replaceProperty(GxOuterGlowProperty* copy);
    void drawGlow(GxECore::ParamPostProcessing* p, Side side);

    GxOuterGlowProperty* property = nullptr;
};

// The spread pass on its own; false (and the plane possibly half done) when
// its row buffers cannot be allocated. With `scratch` its rows come from there.
bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height);
bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height, GxScratch* scratch);
// The same, knowing that outside `content` every byte is 0 or every byte is
// 255 (a pass keeps either): pass p only rewrites the content grown by p.
bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height, GxScratch* scratch,
                   const GxRect& content);

// The glow colour table for a record: single colour, first stop, or ramp from
// 0; then the fade. Null `property` or a size of exactly 0: all transparent.
void MakeGlowColorTable(uint32_t* table, const GxOuterGlowProperty* property, float fadeStart,
                        int curve);

}  // namespace Glimmer
