#pragma once
// Gradient fills: the glyphs filled with a colour ramp, linear (kind 7) or
// radial (kind 8).
//
// Both layers build the 257-entry colour table of their stops (one stop
// fills it with one colour; two or more make a ramp from the first stop's
// position, advancing at most one stop per entry), premultiply it, and fill
// an image of the glyph box's size: a pixel takes a table entry wherever the
// mask is not 0 and stays transparent elsewhere. The mask only gates the
// fill; its coverage is not multiplied in. The image goes to the target
// destination-over at the box's top-left corner; a fill never reaches
// beyond the glyph box.
//
// Only the index of a pixel differs between the two (see each layer). A
// scale below 0.1 or a gradient without stops draws nothing.

#include <cstdint>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxColorRamp.h"
#include "effect/filters/GxLayerSupport.h"
#include "foundation/GxRect.h"

namespace Glimmer {

class GxGradientLayer : public GxECoreBase {
public:
    ~GxGradientLayer() override;

    GxProperty* getProperty() override;

protected:
    // What one drawing needs once the checks have passed.
    struct Fill {
        GxRect box;              // the glyph box on the mask
        int32_t width = 0;       // W
        int32_t height = 0;      // H
        uint32_t table[kColorTableSize];  // premultiplied 0xAARRGGBB
        uint32_t* image = nullptr;        // W x H, cleared to transparent: the stack's
        WorkBuffer<uint32_t> ownImage;    // scratch, or this when it lends none
        const unsigned char* mask = nullptr;  // mask row of the box's top, from its left
        size_t maskStride = 0;

        const unsigned char* MaskRow(int32_t y) const { return mask + size_t(y) * maskStride; }
        uint32_t* ImageRow(int32_t y) { return image + size_t(y) * size_t(width); }
    };

    GxGradientLayer() = default;
    // Takes `copy` (may be null) in place of the current record and gives it
    // its own stops; a copy that cannot get them is dropped.
    void replaceProperty(GxLinearGradientProperty* copy);
    // The checks, the box and the table; false when nothing is to be drawn.
    bool beginFill(GxECore::ParamPostProcessing* p, Fill* fill);
    void endFill(GxECore::ParamPostProcessing* p, Fill* fill);

    GxLinearGradientProperty* property = nullptr;
};

}  // namespace Glimmer
