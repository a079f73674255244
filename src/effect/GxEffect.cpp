// The effect stack.
//
// A drawing runs in five steps. initEffect decides the mode and the order:
// when the text is translucent, or an emboss or a centred stroke is present,
// the stack works with a separate 32-bit work image (mode 1): layers run in
// reverse creation order with the text layer moved last, the layers that lie
// under the text draw into the work image, and compositeLayers merges work
// image and destination through the glyph coverage. Otherwise (mode 0)
// everything draws straight into the destination, front to back: layers
// over the text first, then the text, then the layers under it, each group
// in an order that makes the latest-added layer win within its group, all
// through destination-over blends so what is drawn first stays on top.
//
// renderEffectLayer gathers the glyph masks into one 8-bit mask (union of
// coverage) and tracks their box; doEffectPostProcessing lets every layer
// draw from the finished mask; compositeLayers converts the premultiplied
// result to straight colour and applies the text colour's alpha in one pass.
//
// The stack holds at most one layer per kind: adding a kind again only
// replaces its parameters, so the layer keeps its id and its place.

#include "effect/GxEffect.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <new>

#include "effect/GxBlendRows.h"
#include "effect/GxBlender.h"
#include "effect/GxEffectMath.h"
#include "effect/LayerFactory.h"
#include "platform/Log.h"

namespace Glimmer {

using EffectMath::ClampFloat;
using EffectMath::TruncToInt;

namespace {

constexpr char kTag[] = "GxEffect";

#define GX_EFFECT_LOG(...) Platform::LogPrint(Platform::kLogDebug, kTag, __VA_ARGS__)

// --- argument conversions of the add...Text operations

float ClampOpacity(float o) {
    if (o > 1.0f) o = 1.0f;
    if (!(o > 0.0f)) o = 0.0f;
    return o;
}

uint32_t AlphaByte(float opacity) {
    const float sum = opacity * 255.0f + 0.5f;
    if (sum > 255.0f) return 255;
    if (!(sum >= 0.0f)) return 0;
    return uint32_t(sum);
}

// The colour's own alpha is dropped: `alpha` replaces it and scales R, G, B.
uint32_t Premultiply(uint32_t color, uint32_t alpha) {
    uint32_t out = alpha << 24;
    for (int shift = 16; shift >= 0; shift -= 8) {
        const uint32_t p = alpha * (((color >> shift) & 0xFF) + 1);
        out |= (p >= 65536 ? 255u : (p >> 8) & 0xFF) << shift;
    }
    return out;
}

float AngleRule(float angle) {
    int32_t a = TruncToInt(angle) % 360;
    if (a < 0) a += 360;
    return float(a);
}

float PercentClamp(float v) { return float(std::clamp(TruncToInt(v), 0, 100)); }

// The stack's own copy of a colour ramp: each stop's alpha comes from its
// opacity, each position is cut to two decimals. Freed by the caller with
// delete[] once the layer has taken its copy.
GxGradient* GradientCopy(const GxGradient* stops, int count) {
    GxGradient* copy = GxCopyGradientStops(stops, count);
    if (copy == nullptr) return nullptr;
    for (int i = 0; i < count; ++i) {
        copy[i].color = (copy[i].color & 0x00FFFFFFu) | AlphaByte(ClampOpacity(copy[i].opacity)) << 24;
        copy[i].position = float(TruncToInt(copy[i].position * 100.0f)) / 100.0f;
    }
    return copy;
}

// Position of a stroke-like layer; -1 when it has no stroke record.
int32_t StrokePosition(GxECoreBase* layer) {
    auto* p = dynamic_cast<GxStrokeProperty*>(layer->getProperty());
    return p == nullptr ? -1 : p->position;
}

// Bevel style; 0 (an outside bevel) when the layer has no bevel record.
int32_t BevelStyle(GxECoreBase* layer) {
    auto* p = dynamic_cast<GxBevelProperty*>(layer->getProperty());
    return p == nullptr ? 0 : p->style;
}

bool IsStrokeKind(int kind) { return kind == GxECore::kStroke || kind == GxECore::kReserved; }

// A zeroed width x height image, on the spare's pixel block when it is large
// enough (the spare is used up; *capacity becomes the block's size), else new.
GxBitmap* ReuseOrMake(GxBitmap** spare, size_t* spareBytes, unsigned w, unsigned h, unsigned depth,
                      size_t* capacity) {
    size_t bytes = 0;
    GxBitmap* image = *spare;
    *capacity = 0;
    if (image != nullptr && image->bytesPerPixel == depth && GxBitmap::PixelBytes(w, h, depth, &bytes) &&
        bytes <= *spareBytes) {
        *capacity = *spareBytes;
        *spare = nullptr;
        *spareBytes = 0;
        image->width = w;
        image->height = h;
        std::memset(image->pixels, 0, bytes);
        return image;
    }
    return new (std::nothrow) GxBitmap(w, h, depth);
}

// Keeps a finished image as the spare (the larger block wins). `capacity` is
// its block's size when known, else 0.
void KeepSpare(GxBitmap** spare, size_t* spareBytes, GxBitmap* image, size_t capacity) {
    if (image == nullptr) return;
    size_t bytes = 0;
    if (image->pixels == nullptr ||
        !GxBitmap::PixelBytes(image->width, image->height, image->bytesPerPixel, &bytes)) {
        delete image;
        return;
    }
    if (capacity > bytes) bytes = capacity;
    if (*spare != nullptr && *spareBytes >= bytes) {
        delete image;
        return;
    }
    delete *spare;
    *spare = image;
    *spareBytes = bytes;
}

}  // namespace

// --- construction

GxEffect::GxEffect() { GX_EFFECT_LOG("GxEffect(%p)", static_cast<void*>(this)); }

GxEffect::GxEffect(void*) {}

GxEffect::GxEffect(const GxEffect& other)
    : separateWorkImage(other.separateWorkImage),
      textOpacity(other.textOpacity),
      textColor(other.textColor),
      nextEffectId(other.nextEffectId),
      textAlpha(other.textAlpha),
      layerStyle(other.layerStyle) {
    for (GxECoreBase* layer : other.layers)
        addEffect(layer->getId(), layer->getStyle(), layer->getProperty());
}

GxEffect::~GxEffect() {
    releaseEffect();
    releaseBitmap();
    GX_EFFECT_LOG("~GxEffect(%p)", static_cast<void*>(this));
}

// --- ids and layers

int GxEffect::getNewEffectId() {
    if (nextEffectId < 0) {
        nextEffectId = 1;
        return 0;
    }
    const int id = nextEffectId;
    // Past the largest id the counter wraps negative, and so restarts at 0.
    nextEffectId = id == INT32_MAX ? INT32_MIN : id + 1;
    return id;
}

GxECoreBase* GxEffect::newLayer(int kind) { return CreateEffectLayer(kind); }

GxECoreBase* GxEffect::createEffect(int id, int kind) {
    if (kind < GxECore::kOuterShadow || kind > GxECore::kText || kind == GxECore::kReserved)
        return nullptr;
    GxECoreBase* layer = newLayer(kind);
    if (layer == nullptr) return nullptr;
    layer->setId(id < 0 ? getNewEffectId() : id);
    return layer;
}

int GxEffect::addEffect(int id, int kind, GxProperty* property) {
    if (GxECoreBase* existing = getEffect(kind)) {
        existing->setProperty(property);
        return existing->getId();
    }
    GxECoreBase* layer = createEffect(id, kind);
    if (layer == nullptr) return -1;
    layer->setProperty(property);
    try {
        layers.push_back(layer);
    } catch (...) {
        delete layer;
        return -1;
    }
    return layer->getId();
}

int GxEffect::addEffect(int kind, GxProperty* property) { return addEffect(-1, kind, property); }

GxECoreBase* GxEffect::getEffect(int kind) {
    for (GxECoreBase* layer : layers)
        if (layer->getStyle() == kind) return layer;
    return nullptr;
}

bool GxEffect::hasEffect(int kind) { return getEffect(kind) != nullptr; }

bool GxEffect::hasEffects() { return !layers.empty() || textOpacity < 1.0f; }

bool GxEffect::removeEffect(int id) {
    for (GxECoreBase* layer : layers) {
        if (layer->getId() == id) {
            releaseEffect(layer);
            return true;
        }
    }
    return false;
}

void GxEffect::releaseEffect(GxECoreBase* layer) {
    if (layer == nullptr) return;
    // Never leave a deleted layer behind in either list.
    layers.erase(std::remove(layers.begin(), layers.end(), layer), layers.end());
    renderOrder.erase(std::remove(renderOrder.begin(), renderOrder.end(), layer), renderOrder.end());
    delete layer;
}

void GxEffect::releaseEffect() {
    for (GxECoreBase* layer : layers) delete layer;
    layers.clear();
    renderOrder.clear();
    nextEffectId = 0;
}

void GxEffect::cleanAllEffect() { releaseEffect(); }

void GxEffect::cleanLayers() {}

void GxEffect::releaseBitmap() {
    delete srcBitmap;
    srcBitmap = nullptr;
    delete workBitmap;
    workBitmap = nullptr;
    srcCapacity = workCapacity = 0;
    dstBitmap = nullptr;
    delete spareMask;
    spareMask = nullptr;
    spareMaskBytes = 0;
    delete spareWork;
    spareWork = nullptr;
    spareWorkBytes = 0;
    scratch.release();
}

void GxEffect::setSrcBitmap(GxBitmap* bitmap) {
    if (bitmap != srcBitmap) {
        delete srcBitmap;
        srcCapacity = 0;
    }
    srcBitmap = bitmap;
}

// --- effect operations

int GxEffect::addOuterShadowText(float angle, float distance, float size, unsigned color,
                                 float opacity) {
    const float o = ClampOpacity(opacity);
    GxOuterShadowProperty record(AngleRule(angle), PercentClamp(distance), PercentClamp(size),
                                 Premultiply(color, AlphaByte(o)), o);
    return addEffect(-1, GxECore::kOuterShadow, &record);
}

int GxEffect::addInnerShadowText(float angle, float distance, float size, unsigned color,
                                 float opacity) {
    const float o = ClampOpacity(opacity);
    GxInnerShadowProperty record(AngleRule(angle), PercentClamp(distance), PercentClamp(size),
                                 Premultiply(color, AlphaByte(o)), o);
    return addEffect(-1, GxECore::kInnerShadow, &record);
}

namespace {
// A glow record of either kind, with the stack's copy of the ramp; the copy
// is dropped once the layer holds its own. Without stops the count is 0.
template <typename Record>
int AddGlow(GxEffect* stack, int kind, float size, unsigned color, float opacity, int count,
            const GxGradient* stops) {
    const float o = ClampOpacity(opacity);
    GxGradient* ramp = GradientCopy(stops, count);
    Record record(PercentClamp(size), (color & 0x00FFFFFFu) | AlphaByte(o) << 24, o,
                  ramp == nullptr ? 0 : count, ramp);
    const int id = stack->addEffect(-1, kind, &record);
    delete[] ramp;
    return id;
}

template <typename Record>
int AddGradient(GxEffect* stack, int kind, float angle, float scale, float opacity, int count,
                const GxGradient* stops) {
    GxGradient* ramp = GradientCopy(stops, count);
    Record record(angle, scale, opacity, ramp == nullptr ? 0 : count, ramp);
    const int id = stack->addEffect(-1, kind, &record);
    delete[] ramp;
    return id;
}
}  // namespace

int GxEffect::addOuterGlowText(float size, unsigned color, float opacity, int count,
                               const GxGradient* stops) {
    return AddGlow<GxOuterGlowProperty>(this, GxECore::kOuterGlow, size, color, opacity, count, stops);
}

int GxEffect::addInnerGlowText(float size, unsigned color, float opacity, int count,
                               const GxGradient* stops) {
    return AddGlow<GxInnerGlowProperty>(this, GxECore::kInnerGlow, size, color, opacity, count, stops);
}

int GxEffect::addBevelText(int style, float depth, float size, int direction, int technique,
                           int soften, float opacity, float angle, float altitude,
                           unsigned highlightColor, float highlightOpacity, unsigned shadowColor,
                           float shadowOpacity) {
    GxBevelProperty record(style, depth, size, direction, technique, soften, opacity, angle,
                           altitude, highlightColor, ClampOpacity(highlightOpacity), shadowColor,
                           ClampOpacity(shadowOpacity));
    return addEffect(-1, GxECore::kBevel, &record);
}

int GxEffect::addEmbossText(int style, float depth, float size, int direction, int technique,
                            int soften, float opacity, float angle, float altitude,
                            unsigned highlightColor, float highlightOpacity, unsigned shadowColor,
                            float shadowOpacity) {
    GxEmbossProperty record(style, depth, size, direction, technique, soften, opacity, angle,
                            altitude, highlightColor, ClampOpacity(highlightOpacity), shadowColor,
                            ClampOpacity(shadowOpacity));
    return addEffect(-1, GxECore::kEmboss, &record);
}

int GxEffect::addLinearGradientText(float angle, float scale, float opacity, int count,
                                    const GxGradient* stops) {
    return AddGradient<GxLinearGradientProperty>(this, GxECore::kLinearGradient, AngleRule(angle),
                                                 scale, opacity, count, stops);
}

int GxEffect::addRadialGradientText(float scale, float opacity, int count, const GxGradient* stops) {
    return AddGradient<GxRadialGradientProperty>(this, GxECore::kRadialGradient, 0.0f,
                                                 ClampFloat(scale, 0.0f, 2.0f), opacity, count, stops);
}

int GxEffect::addStrokeText(float size, unsigned color, float opacity, int a, int position) {
    const float o = ClampOpacity(opacity);
    GxStrokeProperty record(PercentClamp(size), Premultiply(color, AlphaByte(o)), o, a, position);
    return addEffect(-1, GxECore::kStroke, &record);
}

int GxEffect::addPatternText(GxBitmap* tile, float scale, float opacity) {
    GxPatternProperty record(tile, ClampFloat(scale, 0.0f, 10.0f), ClampOpacity(opacity));
    return addEffect(-1, GxECore::kPattern, &record);
}

int GxEffect::addText(unsigned color, float opacity) {
    GX_EFFECT_LOG("AddText(%p) - (color:%d/opacity:%f)", static_cast<void*>(this), int(color),
                  double(opacity));
    textAlpha = int32_t(color >> 24);
    const float o = ClampOpacity(opacity);
    GxTextProperty record(Premultiply(color, AlphaByte(o)), o);
    return addEffect(-1, GxECore::kText, &record);
}

int GxEffect::addText(unsigned color) {
    GX_EFFECT_LOG("AddText(%p) - (color:%x)", static_cast<void*>(this), color);
    textAlpha = int32_t(color >> 24);
    GxTextProperty record(color | 0xFF000000u, 1.0f);
    return addEffect(-1, GxECore::kText, &record);
}

void GxEffect::setTextOpacity(float opacity) { textOpacity = ClampOpacity(opacity); }

// --- margins

int GxEffect::margin(int (GxECoreBase::*side)()) {
    int widest = 0;
    for (GxECoreBase* layer : layers) widest = std::max(widest, (layer->*side)());
    return widest;
}

int GxEffect::getLeftOffset() { return margin(&GxECoreBase::getLeftOffset); }
int GxEffect::getRightOffset() { return margin(&GxECoreBase::getRightOffset); }
int GxEffect::getTopOffset() { return margin(&GxECoreBase::getTopOffset); }
int GxEffect::getBottomOffset() { return margin(&GxECoreBase::getBottomOffset); }

// --- cache key

char* GxEffect::getMapKey() {
    int64_t total = 0;
    for (GxECoreBase* layer : layers) {
        if (GxProperty* p = layer->getProperty()) total += std::max(p->getSequentialCharLength(), 0);
    }
    if (total >= INT32_MAX) return nullptr;
    // Zero-filled: the string ends at the last record's terminator, and the
    // unused reserve behind it holds no stale bytes.
    char* key = new (std::nothrow) char[size_t(total) + 1]();
    if (key == nullptr) return nullptr;
    char* cursor = key;
    for (GxECoreBase* layer : layers) {
        if (GxProperty* p = layer->getProperty()) p->toSequentialChar(&cursor);
    }
    *cursor = 0;
    return key;
}

char* GxEffect::getMapKey(unsigned color) {
    textColor = color;
    addText(color, textOpacity);
    return getMapKey();
}

// --- drawing

bool GxEffect::isUnderText(GxECoreBase* layer) const {
    const int kind = layer->getStyle();
    switch (kind) {
        case GxECore::kNoKind:
        case GxECore::kOuterShadow:
        case GxECore::kOuterGlow:
            return true;
        case GxECore::kEmboss:
            return separateWorkImage == 0;
        case GxECore::kBevel:
            return BevelStyle(layer) != 1;
        default:
            break;
    }
    if (IsStrokeKind(kind)) {
        const int32_t position = StrokePosition(layer);
        return (position == 0 && separateWorkImage == 0) || position == 1;
    }
    return false;
}

void GxEffect::orderLayers() {
    if (separateWorkImage == 1) {
        std::reverse(renderOrder.begin(), renderOrder.end());
        auto text = std::find_if(renderOrder.begin(), renderOrder.end(),
                                 [](GxECoreBase* l) { return l->getStyle() == GxECore::kText; });
        if (text != renderOrder.end()) std::rotate(text, text + 1, renderOrder.end());
        return;
    }
    // Over the text (newest first), the text, under the text (newest first).
    // Built in place over the copy of `layers` already held, so no allocation
    // (std::stable_partition would take a buffer; a dozen layers are rotated
    // into place instead).
    std::vector<GxECoreBase*>& order = renderOrder;
    std::reverse(order.begin(), order.end());
    auto isText = [](GxECoreBase* l) { return l->getStyle() == GxECore::kText; };
    auto partition = [](auto first, auto last, auto pred) {
        for (auto it = first; it != last; ++it)
            if (pred(*it)) std::rotate(first++, it, it + 1);
        return first;
    };
    auto over = partition(order.begin(), order.end(), [&](GxECoreBase* l) {
        return !isText(l) && !isUnderText(l);
    });
    auto textEnd = partition(over, order.end(), isText);
    // The text group was gathered newest first; it runs in creation order.
    std::reverse(over, textEnd);
}

void GxEffect::initEffect(int width, int height) {
    GX_EFFECT_LOG("InitEffect(%p)", static_cast<void*>(this));
    try {
        renderOrder = layers;
    } catch (...) {
        renderOrder.clear();
    }

    separateWorkImage = 0;
    if (textOpacity < 1.0f || layerStyle) {
        separateWorkImage = 1;
    } else {
        for (GxECoreBase* layer : layers) {
            const int kind = layer->getStyle();
            if (kind == GxECore::kEmboss || (IsStrokeKind(kind) && StrokePosition(layer) == 0)) {
                separateWorkImage = 1;
                break;
            }
        }
    }

    const unsigned w = unsigned(std::max(width, 0)), h = unsigned(std::max(height, 0));
    KeepSpare(&spareMask, &spareMaskBytes, srcBitmap, srcCapacity);
    srcBitmap = ReuseOrMake(&spareMask, &spareMaskBytes, w, h, 1, &srcCapacity);
    if (separateWorkImage == 1) {
        KeepSpare(&spareWork, &spareWorkBytes, workBitmap, workCapacity);
        workBitmap = ReuseOrMake(&spareWork, &spareWorkBytes, w, h, 4, &workCapacity);
    }
    orderLayers();

    GxECore::ParamInit init{width, height, separateWorkImage};
    for (GxECoreBase* layer : renderOrder) layer->initEffect(&init);
    dstBitmap = nullptr;
}

void GxEffect::renderEffectLayer(int x, int y, GxGlyph* glyph) {
    // Every glyph stretches the text box, a zero-sized one too: its mask
    // draws nothing, but its place still counts.
    if (glyph != nullptr && srcBitmap != nullptr) {
        auto saturate = [](int64_t v) { return int32_t(std::clamp<int64_t>(v, INT32_MIN, INT32_MAX)); };
        const int32_t right = saturate(int64_t(x) + glyph->width);
        const int32_t bottom = saturate(int64_t(y) + glyph->height);
        if (textRectReset) {
            textRect = GxRect(x, y, right, bottom);
            textRectReset = false;
        }
        textRect.left = std::min(textRect.left, x);
        textRect.top = std::min(textRect.top, y);
        textRect.right = std::max(textRect.right, right);
        textRect.bottom = std::max(textRect.bottom, bottom);
        GxBlender::drawBitmap(x, y, srcBitmap, glyph->buffer, glyph->width, glyph->height,
                              0xFF000000u);
    }
    GxECore::ParamRender param{x, y, glyph, dstBitmap};
    for (GxECoreBase* layer : renderOrder) layer->render(&param);
}

void GxEffect::chooseTargets(GxECoreBase* layer, GxECore::ParamPostProcessing* pp) {
    pp->extraDst = nullptr;
    const int kind = layer->getStyle();
    switch (kind) {
        case GxECore::kOuterShadow:
        case GxECore::kOuterGlow:
        case GxECore::kNoKind:
            pp->dst = workBitmap;
            return;
        case GxECore::kBevel:
            pp->dst = BevelStyle(layer) == 1 ? dstBitmap : workBitmap;
            return;
        case GxECore::kEmboss:
            pp->dst = workBitmap;
            pp->extraDst = dstBitmap;
            return;
        default:
            break;
    }
    if (IsStrokeKind(kind)) {
        const int32_t position = StrokePosition(layer);
        if (position == 0) {
            pp->dst = workBitmap;
            pp->extraDst = dstBitmap;
        } else {
            pp->dst = position == 2 ? dstBitmap : workBitmap;
        }
        return;
    }
    pp->dst = dstBitmap;
}

void GxEffect::doEffectPostProcessing() {
    GX_EFFECT_LOG("DoEffectPostProcessing(%p) - start", static_cast<void*>(this));
    // A drawing without glyphs keeps the box the previous drawing left here
    // (already clamped to that drawing's mask): only the first glyph of a
    // drawing starts a new box.
    const int32_t maskWidth = srcBitmap != nullptr ? int32_t(srcBitmap->width) : 0;
    const int32_t maskHeight = srcBitmap != nullptr ? int32_t(srcBitmap->height) : 0;
    textRect.left = std::min(std::max(textRect.left, 0), maskWidth);
    textRect.top = std::min(std::max(textRect.top, 0), maskHeight);
    textRect.right = std::max(std::min(textRect.right, maskWidth), 0);
    textRect.bottom = std::max(std::min(textRect.bottom, maskHeight), 0);

    if (textRect.right > textRect.left && textRect.bottom > textRect.top) {
        GxECore::ParamPostProcessing pp{dstBitmap, srcBitmap, &textRect, separateWorkImage, nullptr,
                                        &scratch};
        for (GxECoreBase* layer : renderOrder) {
            if (separateWorkImage == 1) chooseTargets(layer, &pp);
            layer->doPostProcessing(&pp);
        }
    }
    textRectReset = true;
    GX_EFFECT_LOG("DoEffectPostProcessing(%p) - end", static_cast<void*>(this));
}

void GxEffect::compositeLayers(GxBitmap* dst) {
    GX_EFFECT_LOG("CompositeLayers(%p) - start", static_cast<void*>(this));
    if (dst != nullptr && dst->pixels != nullptr && dst->bytesPerPixel == 4) {
        const BlendRows::Table& rows = BlendRows::Active();
        const size_t n = size_t(dst->width) * dst->height;  // fits: the block was allocated
        if (separateWorkImage == 1 && n > 0 && srcBitmap != nullptr && srcBitmap->pixels != nullptr &&
            workBitmap != nullptr && workBitmap->pixels != nullptr) {
            // Merged over the pixels all three images have; a destination
            // larger than the drawing keeps the rest as it is.
            const size_t maskPixels = size_t(srcBitmap->width) * srcBitmap->height;
            const size_t workPixels = size_t(workBitmap->width) * workBitmap->height;
            const size_t count = std::min({n, maskPixels, workPixels});
            if (count > 0) rows.mergeWork(dst->pixels, workBitmap->pixels, srcBitmap->pixels, int(count));
        }
        if (n > 0) {
            const auto finish = wordOrderOutput ? rows.unpremultiplySwap : rows.unpremultiply;
            finish(dst->pixels, int(n), uint32_t(textAlpha) & 0xFF);
        }
    }
    KeepSpare(&spareMask, &spareMaskBytes, srcBitmap, srcCapacity);
    srcBitmap = nullptr;
    KeepSpare(&spareWork, &spareWorkBytes, workBitmap, workCapacity);
    workBitmap = nullptr;
    dstBitmap = nullptr;
    separateWorkImage = 0;
    GX_EFFECT_LOG("CompositeLayers(%p) - end", static_cast<void*>(this));
}

}  // namespace Glimmer
