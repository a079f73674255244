// Fonts from Java: font bytes under a name, the device's font configuration,
// and the font of one text by path, by bytes or from the application's
// assets.
//
// The font configuration is read from Java in full first (families, their
// fonts, languages and variants), by the rules of a device's configuration:
// only the first named family is kept, and every later named family is
// dropped before its fonts are read; a null family or font is passed over.
// A missing Java method or a Java exception anywhere fails the whole
// conversion before a single family is made, so a failed call changes
// nothing. The records then become the font manager's system families
// (ConvertToFontFamilies): which fonts are skipped, which families are
// loaded at once and which wait for a text that needs their locale list is
// decided there. The families are set once per process; later calls return
// true and change nothing.
//
// Font bytes are always copied out of the Java array (nothing stays pinned)
// into a new[] array that the font manager takes, on success and failure
// alike. Asset bytes are read the same way.
//
// Every native here starts the thread's reason afresh and leaves one on
// each failure (a file that is missing, unreadable or no font, a null
// argument, a missing asset), so Java can tell why a call returned false.
//
// On Linux the system's own families can be installed instead of a Java
// font configuration (GxFontManager_InstallSystemFontFamilies): read from
// fontconfig and laid out as a device hands them over, then converted by
// the same rules; the first set of families wins either way.

#include <jni.h>

#include <climits>
#include <mutex>
#include <new>
#include <string>
#include <vector>

#include "font/FontManager.h"
#include "font/SystemFontFamilies.h"
#include "foundation/Error.h"
#include "foundation/GxLog.h"
#include "foundation/List.h"
#include "jni/GxBridge.h"
#include "jni/JavaAssets.h"
#include "jni/JniSupport.h"
#include "platform/Log.h"
#include "platform/SystemFonts.h"
#include "text/GxTextObject.h"

namespace Glimmer {

using Jni::JavaCalls;
using Jni::LocalRef;
using Jni::MethodSpec;
using Platform::kLogDebug;
using Platform::kLogError;
using Platform::LogPrint;

namespace {

constexpr const char* kManagerTag = Bridge::kFontManagerTag;
constexpr const char* kTextTag = Bridge::kTextTag;
constexpr const char* kNotFound = "Java function %s not found";

enum FamilyMethod { kGetName, kGetFonts, kGetLanguages, kGetVariant, kFamilyMethods };
constexpr MethodSpec kFamilySpecs[kFamilyMethods] = {
    {"getName", "()Ljava/lang/String;"},
    {"getFonts", "()[Landroid/text/FontConfig$Font;"},
    {"getLanguages", "()Ljava/lang/String;"},
    {"getVariant", "()I"},
};

enum FontMethod { kGetFontName, kGetTtcIndex, kGetWeight, kIsItalic, kGetFallbackFor, kFontMethods };
constexpr MethodSpec kFontSpecs[kFontMethods] = {
    {"getFontName", "()Ljava/lang/String;"},
    {"getTtcIndex", "()I"},
    {"getWeight", "()I"},
    {"isItalic", "()Z"},
    {"getFallbackFor", "()Ljava/lang/String;"},
};

// The UTF-8 text of a string returned by a Java call (deleting the local
// reference); empty for null. `present` tells null from empty.
std::string TakeString(JNIEnv* env, jobject value, bool* present = nullptr) {
    LocalRef<jstring> text(env, static_cast<jstring>(value));
    if (present != nullptr) *present = bool(text);
    Jni::Utf8Chars chars(env, text.get());
    return chars.get() != nullptr ? std::string(chars.get()) : std::string();
}

LocalRef<jclass> ClassOf(JNIEnv* env, jobject object) {
    return LocalRef<jclass>(env, env->GetObjectClass(object));
}

bool ReadFont(JNIEnv* env, JavaCalls& java, jobject font, Platform::SystemFont* out) {
    LocalRef<jclass> cls = ClassOf(env, font);
    jmethodID m[kFontMethods];
    if (!Jni::LookUpMethods(env, cls.get(), kFontSpecs, kFontMethods, m, kManagerTag, kNotFound)) return false;
    out->path = TakeString(env, java.Object(font, m[kGetFontName]));
    out->ttcIndex = java.Int(font, m[kGetTtcIndex]);
    out->weight = java.Int(font, m[kGetWeight]);
    out->italic = java.Boolean(font, m[kIsItalic]);
    out->fallbackFor = TakeString(env, java.Object(font, m[kGetFallbackFor]));
    return !java.Failed();
}

// Reads the Java font configuration into plain records; false (with the log
// line of what went wrong) when it cannot be read in full.
bool ReadFontConfig(JNIEnv* env, jobject fontConfig, std::vector<Platform::SystemFontFamily>* out) {
    JavaCalls java(env, kManagerTag, "GxFontManager_SetFontConfig");
    LocalRef<jclass> configClass = ClassOf(env, fontConfig);
    const MethodSpec getFamiliesSpec = {"getFamilies", "()[Landroid/text/FontConfig$Family;"};
    jmethodID getFamilies;
    if (!Jni::LookUpMethods(env, configClass.get(), &getFamiliesSpec, 1, &getFamilies, kManagerTag,
                            "Java Function %s not found")) {
        return false;
    }
    LocalRef<jobjectArray> families(env, static_cast<jobjectArray>(java.Object(fontConfig, getFamilies)));
    if (java.Failed()) return false;
    if (!families) return true;

    bool namedSeen = false;
    const jsize familyCount = env->GetArrayLength(families.get());
    for (jsize f = 0; f < familyCount; ++f) {
        LocalRef<jobject> family(env, env->GetObjectArrayElement(families.get(), f));
        if (!family) continue;
        LocalRef<jclass> familyClass = ClassOf(env, family.get());
        jmethodID m[kFamilyMethods];
        if (!Jni::LookUpMethods(env, familyClass.get(), kFamilySpecs, kFamilyMethods, m, kManagerTag,
                                kNotFound)) {
            return false;
        }
        Platform::SystemFontFamily record;
        bool named = false;
        std::string name = TakeString(env, java.Object(family.get(), m[kGetName]), &named);
        if (java.Failed()) return false;
        if (named) {
            if (namedSeen) continue;
            namedSeen = true;
            // Any name makes a named family, an empty one too.
            record.name = name.empty() ? std::string(" ") : name;
        }

        LocalRef<jobjectArray> fonts(env, static_cast<jobjectArray>(java.Object(family.get(), m[kGetFonts])));
        const jsize fontCount = fonts ? env->GetArrayLength(fonts.get()) : 0;
        for (jsize i = 0; i < fontCount; ++i) {
            LocalRef<jobject> font(env, env->GetObjectArrayElement(fonts.get(), i));
            if (!font) continue;
            Platform::SystemFont entry;
            if (!ReadFont(env, java, font.get(), &entry)) return false;
            record.fonts.push_back(std::move(entry));
        }
        record.languages = TakeString(env, java.Object(family.get(), m[kGetLanguages]));
        record.variant = java.Int(family.get(), m[kGetVariant]);
        if (java.Failed()) return false;
        out->push_back(std::move(record));
    }
    return true;
}

void DeleteFamilies(List* families) {
    int count = families->GetCount();
    for (int i = 0; i < count; ++i) DeleteFontFamily(static_cast<GxFontFamily*>(families->Get(i)));
    families->RemoveAll();
    delete families;
}

// A copy of a Java byte array in a new[] array, or null.
char* CopyBytes(JNIEnv* env, jbyteArray array, jsize* length) {
    *length = env->GetArrayLength(array);
    char* copy = new (std::nothrow) char[size_t(*length)];
    if (copy != nullptr && *length > 0) {
        env->GetByteArrayRegion(array, 0, *length, reinterpret_cast<jbyte*>(copy));
    }
    return copy;
}

// The whole asset in a new[] array, or null.
char* ReadAsset(Platform::Asset& asset, unsigned* size) {
    int64_t length = asset.GetLength();
    if (length < 0 || length > INT32_MAX) return nullptr;
    char* buffer = new (std::nothrow) char[size_t(length)];
    if (buffer == nullptr) return nullptr;
    int64_t done = 0;
    while (done < length) {
        int64_t n = asset.Read(buffer + done, size_t(length - done));
        if (n <= 0) {
            delete[] buffer;
            return nullptr;
        }
        done += n;
    }
    *size = unsigned(length);
    return buffer;
}

}  // namespace

jboolean GxFontManager_InsertFontData(JNIEnv* env, jclass, jstring fontName, jbyteArray buffer) {
    LogPrint(kLogDebug, kManagerTag, "GxFontManager_InsertFontData");
    Error::ClearReason();
    if (fontName == nullptr) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_InsertFontData() - fontName is NULL");
        Error::SetReason("no font name was given (null)");
        return JNI_FALSE;
    }
    if (buffer == nullptr) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_InsertFontData() - buffer is NULL");
        Error::SetReason("no font bytes were given (null)");
        return JNI_FALSE;
    }
    Jni::Utf8Chars name(env, fontName);
    if (name.get() == nullptr) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_InsertFontData() - Fail to get fontFile string");
        Error::SetReason("the font name could not be read from Java");
        return JNI_FALSE;
    }
    jsize length = 0;
    char* copy = CopyBytes(env, buffer, &length);
    if (copy == nullptr) {
        Error::SetReason("no memory for a copy of the font's %d bytes", int(length));
        return JNI_FALSE;
    }
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    // A font already known under the name is kept; the copy is then freed.
    return FontManager::GetInstance()->AddMinikinFont(name.get(), copy, unsigned(length), 0, true);
}

jboolean GxFontManager_SetFontConfig(JNIEnv* env, jclass, jobject fontConfig) {
    const bool verbose = GxLog::IsAllLogEnable();
    if (verbose) LogPrint(kLogDebug, kManagerTag, "GxFontManager_SetFontConfig()");
    Error::ClearReason();
    FontManager* manager = FontManager::GetInstance();
    {
        std::shared_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
        if (manager->IsSystemFontFamiliesAlreadySet()) {
            if (verbose) LogPrint(kLogDebug, kManagerTag, "GxFontManager_SetFontConfig - already set");
            return JNI_TRUE;
        }
    }
    if (fontConfig == nullptr) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_SetFontConfig - jFontConfig is NULL");
        Error::SetReason("no font configuration was given (null)");
        return JNI_FALSE;
    }

    auto* families = new (std::nothrow) List();
    if (families == nullptr || !families->Construct()) {
        delete families;
        Error::SetReason("no memory for the font families");
        return JNI_FALSE;
    }
    if (verbose) LogPrint(kLogDebug, kManagerTag, "GxFontManager_SetFontConfig >>> ConvertToFontFamilies");
    std::vector<Platform::SystemFontFamily> config;
    // Java is read without the lock: its code may call back into the library.
    bool converted = ReadFontConfig(env, fontConfig, &config);
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    if (converted && manager->IsSystemFontFamiliesAlreadySet()) {
        // Another thread got there first.
        DeleteFamilies(families);
        return JNI_TRUE;
    }
    converted = converted && ConvertToFontFamilies(manager, config, families);
    if (!converted) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_SetFontConfig - cannot convert to native families");
        // A missing method or a Java exception has said which already.
        if (Error::GetReason()[0] == '\0') Error::SetReason("the font configuration could not be converted");
        DeleteFamilies(families);
        return JNI_FALSE;
    }
    if (verbose) LogPrint(kLogDebug, kManagerTag, "GxFontManager_SetFontConfig <<<< ConvertToFontFamilies");
    if (!manager->SetSystemFontFamilies(families)) {
        DeleteFamilies(families);
        return JNI_FALSE;
    }
    return JNI_TRUE;
}

jboolean GxText_SetFont(JNIEnv* env, jobject thiz, jstring fontFile) {
    Error::ClearReason();
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    Jni::Utf8Chars path(env, fontFile);
    if (path.get() == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont() - Fail to get fontFile string");
        Error::SetReason(fontFile == nullptr ? "no font path was given (null)"
                                             : "the font path could not be read from Java");
        return JNI_FALSE;
    }
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    return object->SetFont(path.get());
}

jboolean GxText_SetFont2(JNIEnv* env, jobject thiz, jstring fontName, jbyteArray buffer) {
    Error::ClearReason();
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    if (fontName == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont2() - fontName is NULL");
        Error::SetReason("no font name was given (null)");
        return JNI_FALSE;
    }
    if (buffer == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont2() - buffer is NULL");
        Error::SetReason("no font bytes were given (null)");
        return JNI_FALSE;
    }
    Jni::Utf8Chars name(env, fontName);
    if (name.get() == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont2() - Fail to get fontFile string");
        Error::SetReason("the font name could not be read from Java");
        return JNI_FALSE;
    }
    jsize length = 0;
    char* copy = CopyBytes(env, buffer, &length);
    if (copy == nullptr) {
        Error::SetReason("no memory for a copy of the font's %d bytes", int(length));
        return JNI_FALSE;
    }
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    return object->SetFont(name.get(), copy, unsigned(length));
}

jboolean GxText_SetFont3(JNIEnv* env, jobject thiz, jobject assetManager, jstring fontName) {
    Error::ClearReason();
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    if (assetManager == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont3() - assetManager is NULL");
        Error::SetReason("no asset manager was given (null)");
        return JNI_FALSE;
    }
    if (fontName == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont3() - fontName is NULL");
        Error::SetReason("no asset name was given (null)");
        return JNI_FALSE;
    }
    Jni::Utf8Chars name(env, fontName);
    if (name.get() == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont3() - Fail to get fontFile string");
        Error::SetReason("the asset name could not be read from Java");
        return JNI_FALSE;
    }
    {
        // A font the manager already holds under this name needs no asset.
        std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
        if (FontManager::GetInstance()->IsExisting(name.get(), 0)) return object->SetFont(name.get());
    }
    std::unique_ptr<Platform::AssetManager> assets = Bridge::AssetManagerFromJava(env, assetManager);
    std::unique_ptr<Platform::Asset> asset = assets != nullptr ? assets->Open(name.get()) : nullptr;
    if (asset == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont3() - _ASSET_NOT_FOUND_");
        Error::SetReason("%s: no such asset", name.get());
        return JNI_FALSE;
    }
    unsigned size = 0;
    char* bytes = ReadAsset(*asset, &size);
    asset.reset();
    if (bytes == nullptr) {
        LogPrint(kLogError, kTextTag, "GxText_SetFont3() - Fail to read the asset");
        Error::SetReason("%s: the asset could not be read", name.get());
        return JNI_FALSE;
    }
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    return object->SetFont(name.get(), bytes, size);
}

jboolean GxFontManager_InstallSystemFontFamilies(JNIEnv*, jclass) {
    Error::ClearReason();
    FontManager* manager = FontManager::GetInstance();
    {
        std::shared_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
        if (manager->IsSystemFontFamiliesAlreadySet()) return JNI_TRUE;
    }
    // Asking the system takes a while the first time; renders go on meanwhile.
    const std::vector<Platform::SystemFontFamily> config = Platform::GetSystemFontFamilies();
    if (config.empty()) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_InstallSystemFontFamilies - no system font families");
        Error::SetReason("the system's font configuration lists no usable font families");
        return JNI_FALSE;
    }
    std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
    if (!InstallSystemFontFamilies(manager, config)) {
        LogPrint(kLogError, kManagerTag, "GxFontManager_InstallSystemFontFamilies - cannot convert to native families");
        Error::SetReason("the system's font families could not be converted");
        return JNI_FALSE;
    }
    return JNI_TRUE;
}

}  // namespace Glimmer
