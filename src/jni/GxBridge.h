#pragma once
// The Java bridge: the natives of com/vantrel/android/sdk/gxe/GxText,
// .../gxe/font/FontManager and .../gxe/util/GxError, and what they share.
//
// Nothing here is exported: the library's only public symbol is JNI_OnLoad,
// which registers these functions by the table in GxBridgeLoad.cpp. Each
// native bears the name of its Java method.
//
// Conventions of every GxText native: it finds its native object through the
// Java object's `mHandle` (GetBoundTextObject), reports a missing one as
// error 19 under "GxText_JNI" and returns its failure value (false, 0, -1 or
// null); any other failure is a false result with a log line and no error
// code. No Java exception is left pending.

#include <jni.h>

#include <shared_mutex>

namespace Glimmer {

class GxTextObject;

namespace Bridge {

constexpr const char* kTextTag = "GxText_JNI";
constexpr const char* kFontManagerTag = "Init_GxFontManager_JNI";
constexpr const char* kErrorTag = "GxError_JNI";

// The font manager is not locked, yet every Java thread may call. Natives
// that can add fonts or families to it (the font natives, and setting a
// layout, whose text may ask for the families of its scripts) hold this
// lock exclusively; a render, which only reads the manager, holds it shared.
std::shared_mutex& FontStateLock();

// The native object of a Java GxText. A negative `mHandle` makes, registers
// and binds a new object and writes its handle back; a handle of 0 or more
// is looked up (null when it is no longer registered).
GxTextObject* GetBoundTextObject(JNIEnv* env, jobject thiz);

// GetBoundTextObject for a native: without an object it reports error 19
// under kTextTag and gives null, and the native returns its failure value.
GxTextObject* RequireBoundTextObject(JNIEnv* env, jobject thiz);

// The Java object's `mHandle`; -1 when the field cannot be read.
jint ReadHandle(JNIEnv* env, jobject thiz);

}  // namespace Bridge

// GxError.
jint Error_GetError(JNIEnv* env, jclass cls);

// FontManager.
jboolean GxFontManager_InsertFontData(JNIEnv* env, jclass cls, jstring fontName, jbyteArray buffer);
jboolean GxFontManager_SetFontConfig(JNIEnv* env, jclass cls, jobject fontConfig);

// GxText: life cycle and text state.
void GxText_finalize(JNIEnv* env, jobject thiz);
jboolean GxText_SetPaint(JNIEnv* env, jobject thiz, jobject paint);
jboolean GxText_SetLayout(JNIEnv* env, jobject thiz, jobject layout);
jboolean GxText_SetLine(JNIEnv* env, jobject thiz, jint lines);
jboolean GxText_SetView(JNIEnv* env, jobject thiz, jobject view);

// GxText: effects and rendering.
jint GxText_AddInnerShadowTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat distance,
                                     jfloat size, jint color, jfloat opacity);
jint GxText_AddLinearGradientTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat scale,
                                        jintArray colors, jfloatArray opacities,
                                        jfloatArray positions, jfloat opacity);
jint GxText_AddOuterGlowTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity);
jint GxText_AddOuterShadowTextEffect(JNIEnv* env, jobject thiz, jfloat angle, jfloat distance,
                                     jfloat size, jint color, jfloat opacity);
jint GxText_AddStrokeTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                jint a, jint position);
void GxText_ClearAllTextEffect(JNIEnv* env, jobject thiz);
jintArray GxText_RenderTextEffect(JNIEnv* env, jobject thiz);
jintArray GxText_GetDrawingBitmapSize(JNIEnv* env, jobject thiz);
jint GxText_GetEffectLeftOffset(JNIEnv* env, jobject thiz);
jint GxText_GetEffectTopOffset(JNIEnv* env, jobject thiz);
jint GxText_GetEffectRightOffset(JNIEnv* env, jobject thiz);
jint GxText_GetEffectBottomOffset(JNIEnv* env, jobject thiz);

// GxText: fonts.
jboolean GxText_SetFont(JNIEnv* env, jobject thiz, jstring fontFile);
jboolean GxText_SetFont2(JNIEnv* env, jobject thiz, jstring fontName, jbyteArray buffer);
jboolean GxText_SetFont3(JNIEnv* env, jobject thiz, jobject assetManager, jstring fontName);

// Natives registered each on its own, after the table above: a Java layer
// that lacks one still gets all the others. They start with a clear reason
// and leave one on every failure (Error::GetReason).
jstring Error_GetReason(JNIEnv* env, jclass cls);
jboolean GxFontManager_InstallSystemFontFamilies(JNIEnv* env, jclass cls);
jint GxText_AddInnerGlowTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                   jintArray colors, jfloatArray opacities, jfloatArray positions);
jint GxText_AddOuterGlowGradientTextEffect(JNIEnv* env, jobject thiz, jfloat size, jint color, jfloat opacity,
                                           jintArray colors, jfloatArray opacities, jfloatArray positions);
jint GxText_AddRadialGradientTextEffect(JNIEnv* env, jobject thiz, jfloat scale, jintArray colors,
                                        jfloatArray opacities, jfloatArray positions, jfloat opacity);
jint GxText_AddPatternTextEffect(JNIEnv* env, jobject thiz, jintArray pixels, jint width, jint height,
                                 jfloat scale, jfloat opacity);
jint GxText_AddBevelTextEffect(JNIEnv* env, jobject thiz, jint style, jfloat depth, jfloat size, jint direction,
                               jint technique, jint soften, jfloat opacity, jfloat angle, jfloat altitude,
                               jint highlightColor, jfloat highlightOpacity, jint shadowColor,
                               jfloat shadowOpacity);
jint GxText_AddEmbossTextEffect(JNIEnv* env, jobject thiz, jint style, jfloat depth, jfloat size, jint direction,
                                jint technique, jint soften, jfloat opacity, jfloat angle, jfloat altitude,
                                jint highlightColor, jfloat highlightOpacity, jint shadowColor,
                                jfloat shadowOpacity);
jboolean GxText_SetTextOpacity(JNIEnv* env, jobject thiz, jfloat opacity);
jboolean GxText_SetLayerStyle(JNIEnv* env, jobject thiz, jboolean on);

}  // namespace Glimmer
