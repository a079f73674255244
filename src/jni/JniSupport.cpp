#include "jni/JniSupport.h"

#include <cstring>
#include <new>
#include <string>

#include "foundation/Error.h"
#include "platform/Log.h"

namespace Glimmer::Jni {

namespace {

// Appends one code point as UTF-16.
void AppendUtf16(std::u16string& out, uint32_t c) {
    if (c < 0x10000) {
        out.push_back(char16_t(c));
    } else {
        c -= 0x10000;
        out.push_back(char16_t(0xD800 + (c >> 10)));
        out.push_back(char16_t(0xDC00 + (c & 0x3FF)));
    }
}

// UTF-8 to UTF-16. A surrogate encoded on its own (modified UTF-8) is kept as
// that unit, so a Java string's text comes back whole; any other malformed
// sequence gives U+FFFD and decoding resumes at the next byte.
std::u16string Utf16Of(const char* text) {
    const auto* s = reinterpret_cast<const unsigned char*>(text);
    const size_t n = std::strlen(text);
    std::u16string out;
    out.reserve(n);
    size_t i = 0;
    while (i < n) {
        const unsigned lead = s[i];
        int extra = -1;   // continuation bytes
        uint32_t c = 0, smallest = 0;
        if (lead < 0x80) {
            extra = 0, c = lead;
        } else if ((lead & 0xE0) == 0xC0) {
            extra = 1, c = lead & 0x1F, smallest = 0x80;
        } else if ((lead & 0xF0) == 0xE0) {
            extra = 2, c = lead & 0x0F, smallest = 0x800;
        } else if ((lead & 0xF8) == 0xF0) {
            extra = 3, c = lead & 0x07, smallest = 0x10000;
        }
        bool ok = extra >= 0 && n - i > size_t(extra);
        for (int k = 1; ok && k <= extra; ++k) {
            const unsigned next = s[i + size_t(k)];
            ok = (next & 0xC0) == 0x80;
            c = c << 6 | (next & 0x3F);
        }
        if (!ok || c < smallest || c > 0x10FFFF) {
            out.push_back(u'\uFFFD');
            ++i;
            continue;
        }
        AppendUtf16(out, c);
        i += size_t(extra) + 1;
    }
    return out;
}

}  // namespace

bool ClearException(JNIEnv* env) {
    if (env->ExceptionCheck() == JNI_FALSE) return false;
    env->ExceptionClear();
    return true;
}

jstring NewStringFromUtf8(JNIEnv* env, const char* utf8) {
    std::u16string text;
    try {
        text = Utf16Of(utf8 != nullptr ? utf8 : "");
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
    static_assert(sizeof(char16_t) == sizeof(jchar));
    jstring string = env->NewString(reinterpret_cast<const jchar*>(text.data()), jsize(text.size()));
    if (string == nullptr) ClearException(env);
    return string;
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
            Error::SetReason("the Java method %s%s is missing (a framework class of another version)",
                             specs[i].name, specs[i].signature);
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
    Error::SetReason("%s: a Java method of the framework object threw an exception", context_);
    return false;
}

}  // namespace Glimmer::Jni
