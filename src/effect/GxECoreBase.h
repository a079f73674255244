#pragma once
// The layer interface. The effect stack drives every layer through three
// phases per drawing: initEffect once the surface size is known, render once
// per glyph image, doPostProcessing once all glyphs are in the mask. Every
// layer of this library does all its work in doPostProcessing, from the
// finished mask, and ends in a GxBlender call.

#include <cstdint>

#include "effect/GxGlyph.h"
#include "effect/GxProperty.h"
#include "effect/GxScratch.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer {

namespace GxECore {

// Effect kinds, as getStyle() returns them. 9 has no layer class, but the
// stack orders it like a stroke; 13 is a layer that has not set its kind.
enum Kind : int32_t {
    kOuterShadow = 1,
    kInnerShadow = 2,
    kOuterGlow = 3,
    kInnerGlow = 4,
    kBevel = 5,
    kEmboss = 6,
    kLinearGradient = 7,
    kRadialGradient = 8,
    kReserved = 9,
    kStroke = 10,
    kPattern = 11,
    kText = 12,
    kNoKind = 13,
};

struct ParamInit {
    int32_t width;              // of the 8-bit source mask
    int32_t height;
    int32_t separateWorkImage;  // 1: a work image exists, layers run reversed, text last
};

struct ParamRender {
    int32_t x;  // where the glyph was placed in the mask
    int32_t y;
    GxGlyph* glyph;
    GxBitmap* dst;  // the stack's destination as it stands (may be null)
};

struct ParamPostProcessing {
    GxBitmap* dst;       // 32-bit image this layer draws into
    GxBitmap* src;       // 8-bit coverage of every glyph drawn
    GxRect* textRect;    // glyph box, clamped to src, never empty
    int32_t separateWorkImage;
    GxBitmap* extraDst;  // second target while drawing to the work image, else null
    // The stack's work memory; the layer's slots are free for it until it
    // returns. Null: the layer allocates its own.
    GxScratch* scratch = nullptr;
};

}  // namespace GxECore

class GxECoreBase {
public:
    GxECoreBase() {}
    GxECoreBase(const GxECoreBase&) = delete;
    GxECoreBase& operator=(const GxECoreBase&) = delete;
    virtual ~GxECoreBase() {}

    virtual bool initEffect(GxECore::ParamInit*) { return true; }
    virtual void render(GxECore::ParamRender*) {}
    virtual void doPostProcessing(GxECore::ParamPostProcessing*) {}
    // The layer keeps its own copy of `property`; the caller keeps the original.
    virtual void setProperty(GxProperty* property) = 0;
    virtual GxProperty* getProperty() = 0;
    virtual float getOpacity() { return 1.0f; }
    virtual int32_t getStyle() { return style; }
    // Pixels by which the layer's drawing reaches beyond the glyph box.
    virtual int32_t getLeftOffset() { return getOffset(); }
    virtual int32_t getRightOffset() { return getOffset(); }
    virtual int32_t getTopOffset() { return getOffset(); }
    virtual int32_t getBottomOffset() { return getOffset(); }
    virtual void setId(int newId) { id = newId; }
    virtual int32_t getId() { return id; }
    virtual int32_t getOffset() { return 0; }

protected:
    int32_t style = GxECore::kNoKind;
    int32_t id = -1;
};

}  // namespace Glimmer
