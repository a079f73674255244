#include "jni/JniSupport.h"

#include "platform/Log.h"

namespace Glimmer::Jni {

bool ClearException(JNIEnv* env) {
    if (env->ExceptionCheck() == JNI_FALSE) return false;
    env->ExceptionClear();
    return true;
}

Utf8Chars::Utf8Chars(JNIEnv* env, jstring text) : env_(env), text_(text) {
    if (text_ == nullptr) return;
    chars_ = env_->GetStringUTFChars(text_, nullptr);
    if (chars_ == nullptr) ClearException(env_);
}

Utf8Chars::~Utf8Chars() {
    if (chars_ != nullptr) env_->ReleaseStringUTFChars(text_, chars_);
}

bool LookUpMethods(JNIEnv* env, jclass cls, const MethodSpec* specs, size_t count, jmethodID* ids,
                   const char* tag, const char* notFoundFormat) {
    for (size_t i = 0; i < count; ++i) {
        ids[i] = cls != nullptr ? env->GetMethodID(cls, specs[i].name, specs[i].signature) : nullptr;
        if (ids[i] == nullptr) {
            ClearException(env);
            Platform::LogPrint(Platform::kLogError, tag, notFoundFormat, specs[i].name);
            return false;
        }
    }
    return true;
}

jmethodID FindMethod(JNIEnv* env, jobject object, const char* name, const char* signature) {
    if (object == nullptr) return nullptr;
    LocalRef<jclass> cls(env, env->GetObjectClass(object));
    if (!cls) {
        ClearException(env);
        return nullptr;
    }
    jmethodID method = env->GetMethodID(cls.get(), name, signature);
    if (method == nullptr) ClearException(env);
    return method;
}

bool JavaCalls::Check() {
    if (!ClearException(env_)) return true;
    failed_ = true;
    Platform::LogPrint(Platform::kLogError, tag_, "%s - Java exception", context_);
    return false;
}

}  // namespace Glimmer::Jni
