// Loading the library into a Java process.
//
// JNI_OnLoad registers the natives of three classes, in this order: the error
// class, the font manager, the text class. Each step runs whatever became of
// the others, so a Java layer of another version (a class or a method
// missing) still gets every native that can be had. After each failed step
// the pending exception is looked at: a NoSuchMethodError (a missing Java
// method, or a native the class does not declare) is swallowed; anything
// else is handed to the loader. Handing it on at once would leave it pending
// under the next steps' JNI calls, so the first such exception is kept and
// thrown when all steps have run.
//
// The error class also tells the log, once per process, whether this is an
// engineering build (all logging on), through its static isBuildTypeEngMode.
//
// Natives that came after the first Java layer (more effect kinds, the
// layer-style switch, failure reasons, the system's fonts on Linux) are
// registered afterwards, each on its own. A Java class that lacks one (an
// older Java layer) gets all the others: its NoSuchMethodError is cleared
// and one debug line names the native. The first three steps, and their
// log, are untouched by them.

#include <jni.h>

#include <cstring>

#include "foundation/Error.h"
#include "foundation/GxLog.h"
#include "jni/GxBridge.h"
#include "jni/JniSupport.h"
#include "platform/Log.h"

namespace Glimmer {
namespace {

constexpr jint kJniVersion = JNI_VERSION_1_2;  // 0x10002
constexpr const char* kCommonTag = "GxText_Common_JNI";

constexpr const char* kErrorClass = "com/vantrel/android/sdk/gxe/util/GxError";
constexpr const char* kFontManagerClass = "com/vantrel/android/sdk/gxe/font/FontManager";
constexpr const char* kTextClass = "com/vantrel/android/sdk/gxe/GxText";

template <typename F>
JNINativeMethod Native(const char* name, const char* signature, F function) {
    return {const_cast<char*>(name), const_cast<char*>(signature), reinterpret_cast<void*>(function)};
}

// One table, each class registering its own slice: 1 error native, 2 font
// manager natives, 20 text natives.
const JNINativeMethod kNatives[] = {
    Native("Error_GetError", "()I", Error_GetError),
    Native("GxFontManager_InsertFontData", "(Ljava/lang/String;[B)Z", GxFontManager_InsertFontData),
    Native("GxFontManager_SetFontConfig", "(Landroid/text/FontConfig;)Z", GxFontManager_SetFontConfig),
    Native("GxText_finalize", "()V", GxText_finalize),
    Native("GxText_AddInnerShadowTextEffect", "(FFFIF)I", GxText_AddInnerShadowTextEffect),
    Native("GxText_AddLinearGradientTextEffect", "(FF[I[F[FF)I", GxText_AddLinearGradientTextEffect),
    Native("GxText_AddOuterGlowTextEffect", "(FIF)I", GxText_AddOuterGlowTextEffect),
    Native("GxText_AddOuterShadowTextEffect", "(FFFIF)I", GxText_AddOuterShadowTextEffect),
    Native("GxText_AddStrokeTextEffect", "(FIFII)I", GxText_AddStrokeTextEffect),
    Native("GxText_ClearAllTextEffect", "()V", GxText_ClearAllTextEffect),
    Native("GxText_RenderTextEffect", "()[I", GxText_RenderTextEffect),
    Native("GxText_SetFont", "(Ljava/lang/String;)Z", GxText_SetFont),
    Native("GxText_SetFont2", "(Ljava/lang/String;[B)Z", GxText_SetFont2),
    Native("GxText_SetFont3", "(Landroid/content/res/AssetManager;Ljava/lang/String;)Z", GxText_SetFont3),
    Native("GxText_SetPaint", "(Landroid/graphics/Paint;)Z", GxText_SetPaint),
    Native("GxText_SetLayout", "(Landroid/text/Layout;)Z", GxText_SetLayout),
    Native("GxText_SetLine", "(I)Z", GxText_SetLine),
    Native("GxText_SetView", "(Landroid/widget/TextView;)Z", GxText_SetView),
    Native("GxText_GetDrawingBitmapSize", "()[I", GxText_GetDrawingBitmapSize),
    Native("GxText_GetEffectLeftOffset", "()I", GxText_GetEffectLeftOffset),
    Native("GxText_GetEffectTopOffset", "()I", GxText_GetEffectTopOffset),
    Native("GxText_GetEffectRightOffset", "()I", GxText_GetEffectRightOffset),
    Native("GxText_GetEffectBottomOffset", "()I", GxText_GetEffectBottomOffset),
};
constexpr jint kErrorNatives = 1;
constexpr jint kFontManagerNatives = 2;
constexpr jint kTextNatives = 20;
static_assert(sizeof kNatives / sizeof kNatives[0] == kErrorNatives + kFontManagerNatives + kTextNatives);

struct OptionalNative {
    const char* className;
    JNINativeMethod method;
};

const OptionalNative kOptionalNatives[] = {
    {kErrorClass, Native("Error_GetReason", "()Ljava/lang/String;", Error_GetReason)},
    {kFontManagerClass,
     Native("GxFontManager_InstallSystemFontFamilies", "()Z", GxFontManager_InstallSystemFontFamilies)},
    {kTextClass, Native("GxText_AddInnerGlowTextEffect", "(FIF[I[F[F)I", GxText_AddInnerGlowTextEffect)},
    {kTextClass,
     Native("GxText_AddOuterGlowGradientTextEffect", "(FIF[I[F[F)I", GxText_AddOuterGlowGradientTextEffect)},
    {kTextClass, Native("GxText_AddRadialGradientTextEffect", "(F[I[F[FF)I", GxText_AddRadialGradientTextEffect)},
    {kTextClass, Native("GxText_AddPatternTextEffect", "([IIIFF)I", GxText_AddPatternTextEffect)},
    {kTextClass, Native("GxText_AddBevelTextEffect", "(IFFIIIFFFIFIF)I", GxText_AddBevelTextEffect)},
    {kTextClass, Native("GxText_AddEmbossTextEffect", "(IFFIIIFFFIFIF)I", GxText_AddEmbossTextEffect)},
    {kTextClass, Native("GxText_SetTextOpacity", "(F)Z", GxText_SetTextOpacity)},
    {kTextClass, Native("GxText_SetLayerStyle", "(Z)Z", GxText_SetLayerStyle)},
};

// Kept by the load functions for the life of the process.
JavaVM* gVm = nullptr;
jclass gFontManagerClass = nullptr;  // global references
jclass gTextClass = nullptr;

// The exception step after a failed load function. `deferred` collects the
// first exception that is not a NoSuchMethodError, as a global reference.
void HandleException(JNIEnv* env, jthrowable* deferred) {
    if (env->ExceptionCheck() == JNI_FALSE) return;
    jthrowable pending = env->ExceptionOccurred();
    env->ExceptionClear();
    jclass noSuchMethod = env->FindClass("java/lang/NoSuchMethodError");
    bool swallow = false;
    if (noSuchMethod != nullptr) {
        swallow = env->IsInstanceOf(pending, noSuchMethod) == JNI_TRUE;
        env->DeleteLocalRef(noSuchMethod);
    } else {
        env->ExceptionClear();
    }
    if (!swallow && *deferred == nullptr) *deferred = static_cast<jthrowable>(env->NewGlobalRef(pending));
    env->DeleteLocalRef(pending);
}

jclass FindGlobalClass(JNIEnv* env, const char* name) {
    jclass local = env->FindClass(name);
    if (local == nullptr) return nullptr;  // NoClassDefFoundError stays pending
    auto global = static_cast<jclass>(env->NewGlobalRef(local));
    env->DeleteLocalRef(local);
    return global;
}

bool Error_OnLoad(JavaVM* vm) {
    gVm = vm;
    JNIEnv* env = nullptr;
    if (vm->GetEnv(reinterpret_cast<void**>(&env), kJniVersion) != JNI_OK) return false;
    Jni::LocalRef<jclass> cls(env, env->FindClass(kErrorClass));
    if (!cls) return false;
    if (!GxLog::IsCheckedBuildType()) {
        jmethodID engMode = env->GetStaticMethodID(cls.get(), "isBuildTypeEngMode", "()Z");
        if (engMode == nullptr) return false;
        jboolean eng = env->CallStaticBooleanMethod(cls.get(), engMode);
        if (env->ExceptionCheck() == JNI_TRUE) return false;
        GxLog::SetBuildType(eng == JNI_TRUE);
    }
    if (env->RegisterNatives(cls.get(), &kNatives[0], kErrorNatives) < 0) return false;
    Platform::LogPrint(Platform::kLogDebug, Bridge::kErrorTag, "Init .. Done");
    return true;
}

bool GxFontManager_OnLoad(JavaVM* vm, JNIEnv* env) {
    jclass cls = FindGlobalClass(env, kFontManagerClass);
    if (cls == nullptr) return false;
    gFontManagerClass = cls;
    gVm = vm;
    if (env->RegisterNatives(cls, &kNatives[kErrorNatives], kFontManagerNatives) < 0) return false;
    Platform::LogPrint(Platform::kLogDebug, Bridge::kFontManagerTag, "Init_GxFontManager_JNI");
    return true;
}

bool GxText_OnLoad(JavaVM* vm, JNIEnv* env) {
    jclass cls = FindGlobalClass(env, kTextClass);
    if (cls == nullptr) return false;
    gTextClass = cls;
    gVm = vm;
    if (env->RegisterNatives(cls, &kNatives[kErrorNatives + kFontManagerNatives], kTextNatives) < 0) {
        return false;
    }
    Platform::LogPrint(Platform::kLogDebug, Bridge::kTextTag, "JNI_OnLoad .. Done");
    return true;
}

// Registers every optional native whose Java method exists. A missing class
// was reported by its own step already.
void RegisterOptionalNatives(JNIEnv* env, jthrowable* deferred) {
    for (const char* className : {kErrorClass, kFontManagerClass, kTextClass}) {
        Jni::LocalRef<jclass> cls(env, env->FindClass(className));
        if (!cls) {
            Jni::ClearException(env);
            continue;
        }
        for (const OptionalNative& native : kOptionalNatives) {
            if (std::strcmp(native.className, className) != 0) continue;
            if (env->RegisterNatives(cls.get(), &native.method, 1) < 0) {
                Platform::LogPrint(Platform::kLogDebug, kCommonTag, "%s %s: not in %s, not registered",
                                   native.method.name, native.method.signature, className);
                HandleException(env, deferred);
            }
        }
    }
}

}  // namespace

jint Error_GetError(JNIEnv*, jclass) {
    Platform::LogPrint(Platform::kLogDebug, Bridge::kErrorTag, "Error_GetError");
    return Error::GetError();
}

jstring Error_GetReason(JNIEnv* env, jclass) {
    const char* reason = Error::GetReason();
    return reason[0] != '\0' ? Jni::NewStringFromUtf8(env, reason) : nullptr;
}

}  // namespace Glimmer

extern "C" JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
    using namespace Glimmer;
    Platform::LogPrint(Platform::kLogDebug, kCommonTag, "GxText_JNI_OnLoad");
    JNIEnv* env = nullptr;
    if (vm->GetEnv(reinterpret_cast<void**>(&env), kJniVersion) != JNI_OK) return 0;

    jthrowable deferred = nullptr;
    if (!Error_OnLoad(vm)) {
        Platform::LogPrint(Platform::kLogError, kCommonTag, "GxError Onload Fail!");
        HandleException(env, &deferred);
    }
    if (!GxFontManager_OnLoad(vm, env)) {
        Platform::LogPrint(Platform::kLogError, kCommonTag, "GxFontManager OnLoad Fail!");
        HandleException(env, &deferred);
    }
    if (!GxText_OnLoad(vm, env)) {
        Platform::LogPrint(Platform::kLogError, kCommonTag, "GxText OnLoad Fail!");
        HandleException(env, &deferred);
    }
    RegisterOptionalNatives(env, &deferred);
    if (deferred != nullptr) {
        env->Throw(deferred);
        env->DeleteGlobalRef(deferred);
    }
    Platform::LogPrint(Platform::kLogDebug, kCommonTag, "GxText_JNI_OnLoad .... done");
    return kJniVersion;
}
