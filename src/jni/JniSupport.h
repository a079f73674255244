#pragma once
// Small tools the natives share for talking to Java safely.
//
// Every Java method the natives call may be missing (a framework class of
// another version) or may throw (an application subclass). Neither may crash
// the process or leave an exception pending behind the natives' backs, and
// the JVM's checked mode insists that every call that can throw is followed
// by an exception check before the next JNI call. These helpers make that
// the default: lookups that report a missing method by name, calls that
// check and clear what was thrown, and local references that delete
// themselves.

#include <jni.h>

#include <cstddef>

namespace Glimmer::Jni {

// Clears a pending exception; true when there was one.
bool ClearException(JNIEnv* env);

// A new Java string of UTF-8 text (modified UTF-8 too); bytes that are not
// well-formed become U+FFFD. Null when the JVM could not make it (the
// OutOfMemoryError is cleared).
jstring NewStringFromUtf8(JNIEnv* env, const char* utf8);

// A local reference deleted at the end of its scope.
template <typename T = jobject>
class LocalRef {
public:
    LocalRef(JNIEnv* env, T ref) : env_(env), ref_(ref) {}
    ~LocalRef() {
        if (ref_ != nullptr) env_->DeleteLocalRef(ref_);
    }
    LocalRef(const LocalRef&) = delete;
    LocalRef& operator=(const LocalRef&) = delete;

    T get() const { return ref_; }
    explicit operator bool() const { return ref_ != nullptr; }

private:
    JNIEnv* env_;
    T ref_;
};

// The modified UTF-8 characters of a Java string, released at the end of the
// scope. Null for a null string or when the JVM could not provide them (the
// OutOfMemoryError it raised is cleared).
class Utf8Chars {
public:
    Utf8Chars(JNIEnv* env, jstring text);
    ~Utf8Chars();
    Utf8Chars(const Utf8Chars&) = delete;
    Utf8Chars& operator=(const Utf8Chars&) = delete;

    const char* get() const { return chars_; }

private:
    JNIEnv* env_;
    jstring text_;
    const char* chars_ = nullptr;
};

struct MethodSpec {
    const char* name;
    const char* signature;
};

// Looks up every method of `specs` on `cls`, in order, into `ids`. At the
// first one missing, clears the NoSuchMethodError, logs `notFoundFormat`
// (one %s: the method's name) at error priority under `tag`, leaves the
// thread a reason naming the method and returns false.
bool LookUpMethods(JNIEnv* env, jclass cls, const MethodSpec* specs, size_t count, jmethodID* ids,
                   const char* tag, const char* notFoundFormat);

// One method of `object`'s class, or null when the object is null or the
// class has no such method (nothing is logged, nothing stays pending).
jmethodID FindMethod(JNIEnv* env, jobject object, const char* name, const char* signature);

// Calls into Java for one native. The first call that throws is logged once
// under `tag` as "<context> - Java exception" (and left as the thread's
// reason with the exception's class), the exception is cleared and
// every later call through this object is skipped (returning 0 or null), so
// a native can read all it needs and then ask Failed() once before it
// changes anything.
class JavaCalls {
public:
    JavaCalls(JNIEnv* env, const char* tag, const char* context)
        : env_(env), tag_(tag), context_(context) {}

    bool Failed() const { return failed_; }

    template <typename... Args>
    jint Int(jobject object, jmethodID method, Args... args) {
        if (failed_) return 0;
        jint value = env_->CallIntMethod(object, method, args...);
        return Check() ? value : 0;
    }
    template <typename... Args>
    jfloat Float(jobject object, jmethodID method, Args... args) {
        if (failed_) return 0.0f;
        jfloat value = env_->CallFloatMethod(object, method, args...);
        return Check() ? value : 0.0f;
    }
    template <typename... Args>
    bool Boolean(jobject object, jmethodID method, Args... args) {
        if (failed_) return false;
        jboolean value = env_->CallBooleanMethod(object, method, args...);
        return Check() && value != JNI_FALSE;
    }
    // A new local reference (the caller deletes it), or null.
    template <typename... Args>
    jobject Object(jobject object, jmethodID method, Args... args) {
        if (failed_) return nullptr;
        jobject value = env_->CallObjectMethod(object, method, args...);
        if (Check()) return value;
        if (value != nullptr) env_->DeleteLocalRef(value);
        return nullptr;
    }
    template <typename... Args>
    jobject New(jclass cls, jmethodID constructor, Args... args) {
        if (failed_) return nullptr;
        jobject value = env_->NewObject(cls, constructor, args...);
        if (Check()) return value;
        if (value != nullptr) env_->DeleteLocalRef(value);
        return nullptr;
    }

private:
    // False (and failed from now on) when the last call threw.
    bool Check();

    JNIEnv* env_;
    const char* tag_;
    const char* context_;
    bool failed_ = false;
};

}  // namespace Glimmer::Jni
