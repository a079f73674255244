// Effects and rendering from Java.
//
// The effect natives pass their arguments through to the text's effect stack
// and return the new layer's id, or -1. Colour ramps come as three parallel
// arrays (colours, opacities, positions); arrays of different lengths are
// refused without a log line (the thread's reason says why), and an empty
// set of stops is passed on as it is. A pattern tile comes as 0xAARRGGBB
// words, straight alpha, row by row, as a Java bitmap hands its pixels out.
//
// Beside the effect kinds the first Java layer knew (outer and inner shadow,
// outer glow, stroke, linear gradient), natives registered on their own add
// the others, a glow with a colour ramp, the stack's text opacity and its
// layer-style switch; a Java layer without them loads and works as before.
//
// A render draws a picture larger than the view by the effect stack's four
// margins, so effects that reach past the text are not cut off; the text's
// own origin lies at (left margin, top margin) in it. The size is kept in
// the view, where GxText_GetDrawingBitmapSize reads it back.

#include <jni.h>

#include <climits>
#include <memory>
#include <mutex>
#include <new>

#include "effect/GxECoreBase.h"
#include "effect/GxEffect.h"
#include "effect/GxProperty.h"
#include "foundation/Error.h"
#include "jni/GxBridge.h"
#include "jni/JniSupport.h"
#include "platform/Log.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace Glimmer {

using Platform::kLogError;
using Platform::LogPrint;

namespace {

constexpr const char* kTag = Bridge::kTextTag;

// The effect stack of the Java object's text; null after reporting why.
GxEffect* BoundEffect(JNIEnv* env, jobject thiz, const char* missingMessage) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return nullptr;
    GxEffect* effect = object->GetEffect();
    if (effect == nullptr && missingMessage != nullptr) LogPrint(kLogError, kTag, "%s", missingMessage);
    return effect;
}

// Stops read from three parallel Java arrays.
struct Stops {
    std::unique_ptr<GxGradient[]> items;
    jsize count = 0;

    const GxGradient* data() const { return items.get(); }
};

// False (with the thread's reason, and no log line) for a null array, arrays
// of different lengths, or no memory. `what` names the effect in the reason.
bool ReadStops(JNIEnv* env, jintArray colors, jfloatArray opacities, jfloatArray positions, const char* what,
               Stops* out) {
    if (colors == nullptr || opacities == nullptr || positions == nullptr) {
        Error::SetReason("%s: a colour, opacity or position array of the stops is null", what);
        return false;
    }
    const jsize count = env->GetArrayLength(colors);
    if (env->GetArrayLength(opacities) != count || env->GetArrayLength(positions) != count) {
        Error::SetReason("%s: the stops have %d colours, %d opacities and %d positions", what, int(count),
                         int(env->GetArrayLength(opacities)), int(env->GetArrayLength(positions)));
        return false;
    }
    if (count == 0) return true;
    // Copies of the arrays, read one stop at a time; nothing is pinned.
    out->items.reset(new (std::nothrow) GxGradient[size_t(count)]);
    std::unique_ptr<jint[]> c(new (std::nothrow) jint[size_t(count)]);
    std::unique_ptr<jfloat[]> o(new (std::nothrow) jfloat[size_t(count)]);
    std::unique_ptr<jfloat[]> p(new (std::nothrow) jfloat[size_t(count)]);
    if (!out->items || !c || !o || !p) {
        Error::SetReason("%s: no memory for %d stops", what, int(count));
        return false;
    }
    env->GetIntArrayRegion(colors, 0, count, c.get());
    env->GetFloatArrayRegion(opacities, 0, count, o.get());
    env->GetFloatArrayRegion(positions, 0, count, p.get());
    for (jsize i = 0; i < count; ++i) out->items[i] = GxGradient{uint32_t(c[i]), o[i], p[i]};
    out->count = count;
    return true;
}

// The effect stack of the Java object's text for a native registered on its
// own: the thread's reason is its own from the start.
GxEffect* EffectForNewNative(JNIEnv* env, jobject thiz) {
    Error::ClearReason();
    GxEffect* effect = BoundEffect(env, thiz, nullptr);
    if (effect == nullptr && Error::GetReason()[0] == '\0') Error::SetReason("the text has no effect stack");
    return effect;
}

// The id of a layer the stack took, or -1 with the thread's reason.
jint Added(int id, const char* what) {
    if (id < 0) Error::SetReason("%s: the effect stack refused the layer", what);
    return id;
}

jint AddGlow(JNIEnv* env, jobject thiz, int kind, jfloat size, jint color, jfloat opacity, jintArray colors,
             jfloatArray opacities, jfloatArray positions) {
    const char* what = kind == GxECore::kInnerGlow ? "inner glow" : "outer glow";
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return -1;
    Stops stops;
    // A glow without a ramp takes its one colour.
    const bool ramp = colors != nullptr || opacities != nullptr || positions != nullptr;
    if (ramp && !ReadStops(env, colors, opacities, positions, what, &stops)) return -1;
    const int id = kind == GxECore::kInnerGlow
                       ? effect->addInnerGlowText(size, unsigned(color), opacity, stops.count, stops.data())
                       : effect->addOuterGlowText(size, unsigned(color), opacity, stops.count, stops.data());
    return Added(id, what);
}

jint Offset(JNIEnv* env, jobject thiz, int (GxEffect::*side)()) {
    GxEffect* effect = BoundEffect(env, thiz, nullptr);
    return effect != nullptr ? (effect->*side)() : 0;
}

// A new int[] of the values, or null (an OutOfMemoryError is cleared).
jintArray NewIntArray(JNIEnv* env, const jint* values, jsize count) {
    jintArray array = env->NewIntArray(count);
    if (array == nullptr) {
        Jni::ClearException(env);
        LogPrint(kLogError, kTag, "NewIntArray(%d) failed", int(count));
        return nullptr;
    }
    if (count > 0) env->SetIntArrayRegion(array, 0, count, values);
    return array;
}

}  // namespace

jint GxText_AddOuterShadowTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat distance,
                                     jfloat size, jint color, jfloat opacity) {
    GxEffect* effect = BoundEffect(env, thiz, "GxText_AddOuterShadowTextEffect() effect is NULL");
    if (effect == nullptr) return -1;
    return effect->addOuterShadowText(angle, distance, size, unsigned(color), opacity);
}

jint GxText_AddInnerShadowTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat distance,
                                     jfloat size, jint color, jfloat opacity) {
    GxEffect* effect = BoundEffect(env, thiz, "GxText_AddInnerShadowTextEffect() effect is NULL");
    if (effect == nullptr) return -1;
    return effect->addInnerShadowText(angle, distance, size, unsigned(color), opacity);
}

jint GxText_AddOuterGlowTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity) {
    GxEffect* effect = BoundEffect(env, thiz, "GxText_AddOuterGlowTextEffect() - Effect is NULL");
    if (effect == nullptr) return -1;
    return effect->addOuterGlowText(size, unsigned(color), opacity, 0, nullptr);
}

jint GxText_AddStrokeTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                jint a, jint position) {
    GxEffect* effect = BoundEffect(env, thiz, "GxText_AddStrokeTextEffect() effect is NULL");
    if (effect == nullptr) return -1;
    return effect->addStrokeText(size, unsigned(color), opacity, a, position);
}

jint GxText_AddLinearGradientTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat scale,
                                        jintArray colors, jfloatArray opacities,
                                        jfloatArray positions, jfloat opacity) {
    GxEffect* effect = BoundEffect(env, thiz, "GxText_AddLinearGradientTextEffect() effect is NULL");
    if (effect == nullptr) return -1;
    Stops stops;
    if (!ReadStops(env, colors, opacities, positions, "linear gradient", &stops)) return -1;
    // The last Java float is the stack's third argument, the layer opacity.
    return effect->addLinearGradientText(angle, scale, opacity, stops.count, stops.data());
}

jint GxText_AddInnerGlowTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                   jintArray colors, jfloatArray opacities, jfloatArray positions) {
    return AddGlow(env, thiz, GxECore::kInnerGlow, size, color, opacity, colors, opacities, positions);
}

jint GxText_AddOuterGlowGradientTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                           jintArray colors, jfloatArray opacities, jfloatArray positions) {
    return AddGlow(env, thiz, GxECore::kOuterGlow, size, color, opacity, colors, opacities, positions);
}

jint GxText_AddRadialGradientTextEffect(JNIEnv* env, jobject thiz, jfloat scale, jintArray colors,
                                        jfloatArray opacities, jfloatArray positions, jfloat opacity) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return -1;
    Stops stops;
    if (!ReadStops(env, colors, opacities, positions, "radial gradient", &stops)) return -1;
    return Added(effect->addRadialGradientText(scale, opacity, stops.count, stops.data()), "radial gradient");
}

jint GxText_AddPatternTextEffect(JNIEnv* env, jobject thiz, jintArray pixels, jint width, jint height,
                                 jfloat scale, jfloat opacity) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return -1;
    if (pixels == nullptr) {
        Error::SetReason("pattern: the tile has no pixels (null)");
        return -1;
    }
    size_t bytes = 0;
    if (width <= 0 || height <= 0 || !GxBitmap::PixelBytes(unsigned(width), unsigned(height), 4, &bytes)) {
        Error::SetReason("pattern: a tile of %d x %d pixels cannot be made", int(width), int(height));
        return -1;
    }
    const jsize length = env->GetArrayLength(pixels);
    const int64_t count = int64_t(width) * int64_t(height);
    if (int64_t(length) < count) {
        Error::SetReason("pattern: %d pixels are too few for a tile of %d x %d", int(length), int(width),
                         int(height));
        return -1;
    }
    std::unique_ptr<GxBitmap> tile(new (std::nothrow) GxBitmap(unsigned(width), unsigned(height), 4));
    if (tile == nullptr || tile->pixels == nullptr) {
        Error::SetReason("pattern: no memory for a tile of %d x %d", int(width), int(height));
        return -1;
    }
    // The pattern layer reads the bytes alpha, red, green, blue of each pixel:
    // the words' bytes from the most significant down.
    unsigned char* out = tile->pixels;
    jint row[256];
    for (int64_t done = 0; done < count;) {
        const jsize n = jsize(count - done < 256 ? count - done : 256);
        env->GetIntArrayRegion(pixels, jsize(done), n, row);
        for (jsize i = 0; i < n; ++i, out += 4) {
            const uint32_t c = uint32_t(row[i]);
            out[0] = uint8_t(c >> 24);
            out[1] = uint8_t(c >> 16);
            out[2] = uint8_t(c >> 8);
            out[3] = uint8_t(c);
        }
        done += n;
    }
    // The layer keeps its own copy of the tile.
    return Added(effect->addPatternText(tile.get(), scale, opacity), "pattern");
}

jint GxText_AddBevelTextEffect(JNIEnv* env, jobject thiz, jint style, jfloat depth, jfloat size, jint direction,
                               jint technique, jint soften, jfloat opacity, jfloat angle, jfloat altitude,
                               jint highlightColor, jfloat highlightOpacity, jint shadowColor,
                               jfloat shadowOpacity) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return -1;
    return Added(effect->addBevelText(style, depth, size, direction, technique, soften, opacity, angle, altitude,
                                      unsigned(highlightColor), highlightOpacity, unsigned(shadowColor),
                                      shadowOpacity),
                 "bevel");
}

jint GxText_AddEmbossTextEffect(JNIEnv* env, jobject thiz, jint style, jfloat depth, jfloat size, jint direction,
                                jint technique, jint soften, jfloat opacity, jfloat angle, jfloat altitude,
                                jint highlightColor, jfloat highlightOpacity, jint shadowColor,
                                jfloat shadowOpacity) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return -1;
    return Added(effect->addEmbossText(style, depth, size, direction, technique, soften, opacity, angle, altitude,
                                       unsigned(highlightColor), highlightOpacity, unsigned(shadowColor),
                                       shadowOpacity),
                 "emboss");
}

jboolean GxText_SetTextOpacity(JNIEnv* env, jobject thiz, jfloat opacity) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return JNI_FALSE;
    effect->setTextOpacity(opacity);
    return JNI_TRUE;
}

jboolean GxText_SetLayerStyle(JNIEnv* env, jobject thiz, jboolean on) {
    GxEffect* effect = EffectForNewNative(env, thiz);
    if (effect == nullptr) return JNI_FALSE;
    effect->setLayerStyle(on != JNI_FALSE);
    return JNI_TRUE;
}

void GxText_ClearAllTextEffect(JNIEnv* env, jobject thiz) {
    // Reads the handle itself: clearing never creates an object.
    jint handle = Bridge::ReadHandle(env, thiz);
    if (handle < 0) return;
    GxTextObject* object = GxTextObject::FindGxTextObject(handle);
    if (object == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotBound);
        return;
    }
    GxEffect* effect = object->GetEffect();
    if (effect != nullptr) effect->cleanAllEffect();
}

jint GxText_GetEffectLeftOffset(JNIEnv* env, jobject thiz) {
    return Offset(env, thiz, &GxEffect::getLeftOffset);
}

jint GxText_GetEffectTopOffset(JNIEnv* env, jobject thiz) {
    return Offset(env, thiz, &GxEffect::getTopOffset);
}

jint GxText_GetEffectRightOffset(JNIEnv* env, jobject thiz) {
    return Offset(env, thiz, &GxEffect::getRightOffset);
}

jint GxText_GetEffectBottomOffset(JNIEnv* env, jobject thiz) {
    return Offset(env, thiz, &GxEffect::getBottomOffset);
}

jintArray GxText_GetDrawingBitmapSize(JNIEnv* env, jobject thiz) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return nullptr;
    GxView* view = object->GetView();
    if (view == nullptr) return nullptr;
    return NewIntArray(env, view->GetDrawingBitmapSize(), 2);
}

jintArray GxText_RenderTextEffect(JNIEnv* env, jobject thiz) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return nullptr;
    GxView* view = object->GetView();
    if (view == nullptr) return nullptr;
    GxEffect* effect = object->GetEffect();
    int64_t left = 0, top = 0, right = 0, bottom = 0;
    if (effect != nullptr) {
        left = effect->getLeftOffset();
        top = effect->getTopOffset();
        right = effect->getRightOffset();
        bottom = effect->getBottomOffset();
    }
    // The sums wrap as int arithmetic does; the view refuses a negative one
    // and keeps its previous size.
    view->SetBitmapWidth(int32_t(view->GetWidth() + left + right));
    view->SetBitmapHeight(int32_t(view->GetHeight() + top + bottom));
    const int width = view->GetBitmapWidth();
    const int height = view->GetBitmapHeight();

    const unsigned* pixels;
    {
        std::shared_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
        pixels = object->RenderTextEffect(width, height);
    }
    const int64_t count = int64_t(width) * int64_t(height);
    if (count < 0 || count > INT32_MAX) return nullptr;
    // A picture without pixels: empty when there is nothing to hold, else
    // the render failed.
    if (pixels == nullptr) return count == 0 ? NewIntArray(env, nullptr, 0) : nullptr;
    static_assert(sizeof(unsigned) == sizeof(jint));
    return NewIntArray(env, reinterpret_cast<const jint*>(pixels), jsize(count));
}

}  // namespace Glimmer
