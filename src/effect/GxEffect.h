#pragma once
// The effect stack of one text object: owns its layers (at most one per
// kind), sizes the drawing surface from their margins, gathers the glyph
// masks into one coverage mask, lets every layer draw in a fixed order and
// composites the result into a straight-alpha image with the text's alpha.
//
// Drawing protocol: initEffect(w, h); setDstBitmap(dst); renderEffectLayer()
// per glyph; doEffectPostProcessing(); compositeLayers(dst). A stack may be
// drawn any number of times; its mask and work image are handed out only from
// initEffect to compositeLayers, and their memory is kept for the next
// drawing (as is the layers' work memory) until releaseBitmap().

#include <cstdint>
#include <vector>

#include "effect/GxECoreBase.h"
#include "effect/GxGlyph.h"
#include "effect/GxProperty.h"
#include "effect/GxScratch.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer {

class GxEffect {
public:
    GxEffect();
    // The same defaults without the construction log line; the argument is unused.
    explicit GxEffect(void* unused);
    // Own layers with the same ids and parameters as `other`'s.
    GxEffect(const GxEffect& other);
    GxEffect& operator=(const GxEffect&) = delete;
    virtual ~GxEffect();

    virtual bool hasEffects();
    virtual bool hasEffect(int kind);

    // Ids: 0, 1, 2, ...; a negative counter restarts at 0.
    int getNewEffectId();
    // A layer of `kind` with id `id` (a new id when negative), not yet in the
    // stack; null for kinds outside 1..12 and for 9.
    GxECoreBase* createEffect(int id, int kind);
    // At most one layer per kind: adding a kind again replaces its parameters
    // and returns the existing id. -1 when the kind cannot be created.
    int addEffect(int id, int kind, GxProperty* property);
    int addEffect(int kind, GxProperty* property);
    GxECoreBase* getEffect(int kind);
    bool removeEffect(int id);
    void releaseEffect(GxECoreBase* layer);
    // Every layer goes and the ids restart; the images are kept.
    void releaseEffect();
    void cleanAllEffect();
    void cleanLayers();
    // Also frees the memory kept for the next drawing.
    void releaseBitmap();

    // Each builds a record from clamped arguments and adds it; returns the
    // layer id or -1.
    int addOuterShadowText(float angle, float distance, float size, unsigned color, float opacity);
    int addInnerShadowText(float angle, float distance, float size, unsigned color, float opacity);
    int addOuterGlowText(float size, unsigned color, float opacity, int count, const GxGradient* stops);
    int addInnerGlowText(float size, unsigned color, float opacity, int count, const GxGradient* stops);
    int addBevelText(int style, float depth, float size, int direction, int technique, int soften,
                     float opacity, float angle, float altitude, unsigned highlightColor,
                     float highlightOpacity, unsigned shadowColor, float shadowOpacity);
    int addEmbossText(int style, float depth, float size, int direction, int technique, int soften,
                      float opacity, float angle, float altitude, unsigned highlightColor,
                      float highlightOpacity, unsigned shadowColor, float shadowOpacity);
    int addLinearGradientText(float angle, float scale, float opacity, int count,
                              const GxGradient* stops);
    int addRadialGradientText(float scale, float opacity, int count, const GxGradient* stops);
    int addStrokeText(float size, unsigned color, float opacity, int a, int position);
    // The tile stays the caller's; the pattern layer copies it.
    int addPatternText(GxBitmap* tile, float scale, float opacity);
    int addText(unsigned color, float opacity);
    int addText(unsigned color);

    // Layer-style rendering, for the front ends; off by default, which is the
    // exact behaviour. On, every drawing runs with the separate work image, so
    // what the inner effects paint stays inside the glyphs, and the glyph
    // drawing gives the text layer the text opacity as a fill opacity (the
    // other layers keep theirs). The stacking order follows the order of
    // adding, as always: add from the bottom layer up.
    void setLayerStyle(bool on) { layerStyle = on; }
    bool getLayerStyle() const { return layerStyle; }

    void setTextOpacity(float opacity);
    float getTextOpacity() const { return textOpacity; }
    void clearTextOpacity() { textOpacity = 1.0f; }
    unsigned getTextColor() const { return textColor; }
    int getTextAlpha() const { return textAlpha & 0xFF; }
    int getSeparateWorkImage() const { return separateWorkImage; }

    GxBitmap* getSrcBitmap() { return srcBitmap; }
    // Takes ownership; the previous mask is deleted.
    void setSrcBitmap(GxBitmap* bitmap);
    GxBitmap* getDstBitmap() { return dstBitmap; }
    // Not owned: the caller's image.
    void setDstBitmap(GxBitmap* bitmap) { dstBitmap = bitmap; }
    GxRect* getTextRect() { return &textRect; }

    // The largest margin any layer needs on that side; 0 for no layers.
    int getLeftOffset();
    int getRightOffset();
    int getTopOffset();
    int getBottomOffset();

    // The appearance key: every layer's serialisation in stack order, zero
    // terminated, allocated with new[] (the caller delete[]s it); null when
    // no memory is left. The second form first makes the text layer carry
    // `color` at the current text opacity.
    char* getMapKey();
    char* getMapKey(unsigned color);

    // When set, compositeLayers leaves little-endian words 0xAARRGGBB (red and
    // blue swapped as GxBlender::convertBGRAToARGB does) instead of bytes
    // R, G, B, A, in the same pass. Off by default.
    void setWordOrderOutput(bool words) { wordOrderOutput = words; }

    void initEffect(int width, int height);
    void renderEffectLayer(int x, int y, GxGlyph* glyph);
    void doEffectPostProcessing();
    void compositeLayers(GxBitmap* dst);

    // Layers in creation order, and in the order of the last initEffect.
    const std::vector<GxECoreBase*>& getLayers() const { return layers; }
    const std::vector<GxECoreBase*>& getRenderOrder() const { return renderOrder; }

protected:
    // Makes a layer of `kind`; tests substitute recording layers here.
    virtual GxECoreBase* newLayer(int kind);

private:
    bool isUnderText(GxECoreBase* layer) const;
    void orderLayers();
    void chooseTargets(GxECoreBase* layer, GxECore::ParamPostProcessing* pp);
    int margin(int (GxECoreBase::*side)());

    std::vector<GxECoreBase*> layers;       // owned, creation order
    std::vector<GxECoreBase*> renderOrder;  // not owned
    GxBitmap* srcBitmap = nullptr;          // owned, 8-bit mask
    GxBitmap* dstBitmap = nullptr;          // the caller's
    GxBitmap* workBitmap = nullptr;         // owned, only in the separate-work-image mode
    // Finished mask and work image, kept so the next drawing can reuse
    // their pixel blocks (capacity in bytes beside each).
    size_t srcCapacity = 0;                 // pixel block sizes of the two above, 0: their own size
    size_t workCapacity = 0;
    GxBitmap* spareMask = nullptr;
    size_t spareMaskBytes = 0;
    GxBitmap* spareWork = nullptr;
    size_t spareWorkBytes = 0;
    GxScratch scratch;                      // the layers' work memory
    GxRect textRect;
    bool textRectReset = true;
    int32_t separateWorkImage = 0;
    float textOpacity = 1.0f;
    uint32_t textColor = 0xFF000000u;
    int32_t nextEffectId = 0;
    int32_t textAlpha = -1;  // low byte used
    bool layerStyle = false;
    bool wordOrderOutput = false;
};

}  // namespace Glimmer
