// Effects and rendering from Java.
//
// The effect natives pass their arguments through to the text's effect stack
// and return the new layer's id, or -1. The linear gradient takes its stops
// as three parallel arrays (colours, opacities, positions); arrays of
// different lengths are refused without a word, and an empty set of stops
// is passed on as it is.
//
// A render draws a picture larger than the view by the effect stack's four
// margins, so effects that reach past the text are not cut off; the text's
// own origin lies at (left margin, top margin) in it. The size is kept in
// the view, where GxText_GetDrawingBitmapSize reads it back.

#include <jni.h>

#include <climits>
#include <mutex>
#include <new>

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
    if (colors == nullptr || opacities == nullptr || positions == nullptr) return -1;
    const jsize count = env->GetArrayLength(colors);
    if (env->GetArrayLength(opacities) != count || env->GetArrayLength(positions) != count) return -1;

    GxGradient* stops = nullptr;
    if (count > 0) {
        stops = new (std::nothrow) GxGradient[size_t(count)];
        if (stops == nullptr) return -1;
        // Copies of the arrays, read one stop at a time; nothing is pinned.
        auto* c = new (std::nothrow) jint[size_t(count)];
        auto* o = new (std::nothrow) jfloat[size_t(count)];
        auto* p = new (std::nothrow) jfloat[size_t(count)];
        bool copied = c != nullptr && o != nullptr && p != nullptr;
        if (copied) {
            env->GetIntArrayRegion(colors, 0, count, c);
            env->GetFloatArrayRegion(opacities, 0, count, o);
            env->GetFloatArrayRegion(positions, 0, count, p);
            for (jsize i = 0; i < count; ++i) stops[i] = GxGradient{uint32_t(c[i]), o[i], p[i]};
        }
        delete[] c;
        delete[] o;
        delete[] p;
        if (!copied) {
            delete[] stops;
            return -1;
        }
    }
    // The last Java float is the stack's third argument, the layer opacity.
    jint id = effect->addLinearGradientText(angle, scale, opacity, count, stops);
    delete[] stops;
    return id;
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
