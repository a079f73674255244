// Binding Java text objects to native ones, and copying the state of the
// Java text widgets into them.
//
// Binding. A Java GxText keeps only an int, `mHandle`, negative until its
// first native call creates a GxTextObject, registers it (handles 1, 2, 3, ...
// never reused), binds it and writes the handle back. The finaliser releases
// that binding, which deletes the object and unregisters the handle; the
// Java field keeps the stale handle, so any later call finds nothing and
// fails with error 19 instead of reaching freed memory.
//
// State. Each native looks up its whole table of Java methods first (a
// method a native never calls must still exist: the table describes the
// framework version the library was made for), reads everything it needs,
// and only then changes the native object.
//
// Line placement (GxText_SetLayout). The Java Layout has laid the text out
// from y = 0; the records place each shown line's baseline in the view:
//  - lines shown: n = min(count, line limit) when a limit of 1 or more was
//    set, else min(count, the view's maxLines) when that is 1 or more, else
//    none at all;
//  - top gravity (or none): the first baseline at paddingTop + baseline(0);
//    centre or fill: the same, moved down by half the room left below the
//    shown lines, when there is room; bottom: the text's last line bottom
//    sits on the bottom padding;
//  - bottom gravity shows the last n lines, other gravities the first n;
//    each baseline follows the one before by the layout's own spacing.
// A record's box spans the line's left edge and width and its ascent and
// descent; it is what a background colour fills.

#include <jni.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <mutex>
#include <new>
#include <string>

#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "jni/GxBridge.h"
#include "jni/JniSupport.h"
#include "platform/LocaleList.h"
#include "platform/Log.h"
#include "platform/Paint.h"
#include "text/GxLineInfo.h"
#include "text/GxTextInstanceManager.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace Glimmer {

using Jni::JavaCalls;
using Jni::LocalRef;
using Jni::MethodSpec;
using Platform::kLogDebug;
using Platform::kLogError;
using Platform::LogPrint;

namespace {

constexpr const char* kTag = Bridge::kTextTag;

// Paint, in lookup order.
enum PaintMethod {
    kGetTextScaleX, kGetTextSkewX, kGetLetterSpacing, kIsElegantTextHeight, kGetFlags,
    kGetFontFeatureSettings, kGetTextLocales, kGetTextAlign, kGetColor, kGetTextSize,
    kIsFakeBoldText, kPaintMethods
};
constexpr MethodSpec kPaintSpecs[kPaintMethods] = {
    {"getTextScaleX", "()F"},
    {"getTextSkewX", "()F"},
    {"getLetterSpacing", "()F"},
    {"isElegantTextHeight", "()Z"},
    {"getFlags", "()I"},
    {"getFontFeatureSettings", "()Ljava/lang/String;"},
    {"getTextLocales", "()Landroid/os/LocaleList;"},
    {"getTextAlign", "()Landroid/graphics/Paint$Align;"},
    {"getColor", "()I"},
    {"getTextSize", "()F"},
    {"isFakeBoldText", "()Z"},
};

// TextView, in lookup order.
enum ViewMethod {
    kViewGetTextSize, kGetCurrentTextColor, kGetTypeface, kGetTextDirection, kGetLayoutDirection,
    kGetWidth, kGetHeight, kGetPaddingLeft, kGetPaddingRight, kGetPaddingTop, kGetPaddingBottom,
    kGetGravity, kGetMaxLines, kViewMethods
};
constexpr MethodSpec kViewSpecs[kViewMethods] = {
    {"getTextSize", "()F"},
    {"getCurrentTextColor", "()I"},
    {"getTypeface", "()Landroid/graphics/Typeface;"},
    {"getTextDirection", "()I"},
    {"getLayoutDirection", "()I"},
    {"getWidth", "()I"},
    {"getHeight", "()I"},
    {"getPaddingLeft", "()I"},
    {"getPaddingRight", "()I"},
    {"getPaddingTop", "()I"},
    {"getPaddingBottom", "()I"},
    {"getGravity", "()I"},
    {"getMaxLines", "()I"},
};

// Layout, in lookup order.
enum LayoutMethod {
    kLayoutGetWidth, kLayoutGetHeight, kGetTopPadding, kGetBottomPadding, kGetLineCount,
    kGetParagraphDirection, kGetParagraphLeft, kGetParagraphRight, kGetLineBaseline, kGetLineTop,
    kGetLineBottom, kGetLineAscent, kGetLineDescent, kGetLineStart, kGetLineEnd,
    kGetLineVisibleEnd, kGetLineLeft, kGetLineRight, kGetLineMax, kGetLineWidth, kGetText,
    kLayoutMethods
};
constexpr MethodSpec kLayoutSpecs[kLayoutMethods] = {
    {"getWidth", "()I"},
    {"getHeight", "()I"},
    {"getTopPadding", "()I"},
    {"getBottomPadding", "()I"},
    {"getLineCount", "()I"},
    {"getParagraphDirection", "(I)I"},
    {"getParagraphLeft", "(I)I"},
    {"getParagraphRight", "(I)I"},
    {"getLineBaseline", "(I)I"},
    {"getLineTop", "(I)I"},
    {"getLineBottom", "(I)I"},
    {"getLineAscent", "(I)I"},
    {"getLineDescent", "(I)I"},
    {"getLineStart", "(I)I"},
    {"getLineEnd", "(I)I"},
    {"getLineVisibleEnd", "(I)I"},
    {"getLineLeft", "(I)F"},
    {"getLineRight", "(I)F"},
    {"getLineMax", "(I)F"},
    {"getLineWidth", "(I)F"},
    {"getText", "()Ljava/lang/CharSequence;"},
};

constexpr const char* kToString = "()Ljava/lang/String;";

// A float truncated toward zero, as a C cast would, but defined for every
// input: NaN gives 0 and values beyond an int saturate.
int32_t TruncateToInt(float value) {
    if (std::isnan(value)) return 0;
    if (value >= 2147483648.0f) return INT32_MAX;
    if (value <= -2147483648.0f) return INT32_MIN;
    return int32_t(value);
}

// Two's-complement wrap of a sum done in 64 bits: the int arithmetic of the
// placement without its overflow being undefined.
int32_t Wrap(int64_t value) { return int32_t(value); }

LocalRef<jclass> ClassOf(JNIEnv* env, jobject object) {
    return LocalRef<jclass>(env, object != nullptr ? env->GetObjectClass(object) : nullptr);
}

void DeleteLines(List* lines) {
    int count = lines->GetCount();
    for (int i = 0; i < count; ++i) delete static_cast<GxLineInfo*>(lines->Get(i));
    lines->RemoveAll();
}

// The colour of the last BackgroundColorSpan over the whole text, walking
// the spans from the last; false when there is none (or it cannot be read).
bool FindBackgroundColor(JNIEnv* env, JavaCalls& java, jobject text, jint length, jint* color) {
    if (text == nullptr) return false;
    // No JNI call may run with an exception pending: a missing first class is
    // cleared before the second is looked up.
    LocalRef<jclass> spannable(env, env->FindClass("android/text/SpannableString"));
    if (!spannable) Jni::ClearException(env);
    LocalRef<jclass> spanClass(env, spannable ? env->FindClass("android/text/style/BackgroundColorSpan") : nullptr);
    if (!spannable || !spanClass) {
        Jni::ClearException(env);
        LogPrint(kLogDebug, kTag, "GxText_SetLayout - no span classes");
        return false;
    }
    jmethodID constructor = env->GetMethodID(spannable.get(), "<init>", "(Ljava/lang/CharSequence;)V");
    jmethodID getSpans =
        constructor != nullptr
            ? env->GetMethodID(spannable.get(), "getSpans", "(IILjava/lang/Class;)[Ljava/lang/Object;")
            : nullptr;
    jmethodID getColor =
        getSpans != nullptr ? env->GetMethodID(spanClass.get(), "getBackgroundColor", "()I") : nullptr;
    if (getColor == nullptr) {
        Jni::ClearException(env);
        LogPrint(kLogDebug, kTag, "GxText_SetLayout - span methods not found");
        return false;
    }
    LocalRef<jobject> copy(env, java.New(spannable.get(), constructor, text));
    if (!copy) return false;
    LocalRef<jobjectArray> spans(
        env, static_cast<jobjectArray>(java.Object(copy.get(), getSpans, jint(0), length, spanClass.get())));
    if (!spans) return false;
    for (jsize i = env->GetArrayLength(spans.get()) - 1; i >= 0; --i) {
        LocalRef<jobject> span(env, env->GetObjectArrayElement(spans.get(), i));
        if (!span) continue;
        // The array's type is Object[]: a span of another class is not read.
        if (env->IsInstanceOf(span.get(), spanClass.get()) == JNI_FALSE) continue;
        *color = java.Int(span.get(), getColor);
        return !java.Failed();
    }
    return false;
}

}  // namespace

namespace Bridge {

std::shared_mutex& FontStateLock() {
    static std::shared_mutex lock;
    return lock;
}

jint ReadHandle(JNIEnv* env, jobject thiz) {
    if (thiz == nullptr) return -1;
    LocalRef<jclass> cls = ClassOf(env, thiz);
    jfieldID field = cls ? env->GetFieldID(cls.get(), "mHandle", "I") : nullptr;
    if (field == nullptr) {
        Jni::ClearException(env);
        return -1;
    }
    return env->GetIntField(thiz, field);
}

GxTextObject* GetBoundTextObject(JNIEnv* env, jobject thiz) {
    if (thiz == nullptr) return nullptr;
    LocalRef<jclass> cls = ClassOf(env, thiz);
    jfieldID field = cls ? env->GetFieldID(cls.get(), "mHandle", "I") : nullptr;
    if (field == nullptr) {
        Jni::ClearException(env);
        return nullptr;
    }
    jint handle = env->GetIntField(thiz, field);
    if (handle >= 0) return GxTextObject::FindGxTextObject(handle);

    LogPrint(kLogDebug, kTag, "GetBoundTextObject - hande = 0");  // sic: the wording is kept
    auto* object = new (std::nothrow) GxTextObject();
    if (object == nullptr) return nullptr;
    // A text the registry could give no handle (all used up) could never be
    // found again: it is not kept.
    if (!object->Construct() || object->GetRuntimeHandle() < 0) {
        delete object;
        return nullptr;
    }
    GxTextInstanceManager::Bind(object);
    env->SetIntField(thiz, field, object->GetRuntimeHandle());
    return object;
}

GxTextObject* RequireBoundTextObject(JNIEnv* env, jobject thiz) {
    GxTextObject* object = GetBoundTextObject(env, thiz);
    if (object == nullptr) GX_REPORT_ERROR(kTag, kErrorNotBound);
    return object;
}

}  // namespace Bridge

void GxText_finalize(JNIEnv* env, jobject thiz) {
    jint handle = Bridge::ReadHandle(env, thiz);
    if (handle < 0) return;
    GxTextObject* object = GxTextObject::FindGxTextObject(handle);
    if (object == nullptr) return;
    LogPrint(kLogDebug, kTag, "finalize : RH %d", handle);
    GxTextInstanceManager::Release(object, true);
}

jboolean GxText_SetPaint(JNIEnv* env, jobject thiz, jobject paint) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    if (paint == nullptr) {
        LogPrint(kLogError, kTag, "GxText_SetPaint - paint is NULL");
        return JNI_FALSE;
    }
    LocalRef<jclass> cls = ClassOf(env, paint);
    jmethodID m[kPaintMethods];
    if (!Jni::LookUpMethods(env, cls.get(), kPaintSpecs, kPaintMethods, m, kTag,
                            "Java function %s not found")) {
        return JNI_FALSE;
    }

    JavaCalls java(env, kTag, "GxText_SetPaint");
    Platform::Paint native;
    native.scaleX = java.Float(paint, m[kGetTextScaleX]);
    native.skewX = java.Float(paint, m[kGetTextSkewX]);
    native.size = java.Float(paint, m[kGetTextSize]);
    native.embolden = java.Boolean(paint, m[kIsFakeBoldText]);
    native.letterSpacing = java.Float(paint, m[kGetLetterSpacing]);
    native.familyVariant = java.Boolean(paint, m[kIsElegantTextHeight]) ? Platform::Paint::kVariantElegant
                                                                        : Platform::Paint::kVariantDefault;
    native.SetJavaFlags(uint32_t(java.Int(paint, m[kGetFlags])));

    LocalRef<jstring> features(env, static_cast<jstring>(java.Object(paint, m[kGetFontFeatureSettings])));
    if (features) {
        Jni::Utf8Chars chars(env, features.get());
        if (chars.get() != nullptr) native.fontFeatureSettings = chars.get();
    }

    LocalRef<jobject> locales(env, java.Object(paint, m[kGetTextLocales]));
    if (locales) {
        jmethodID toLanguageTags = Jni::FindMethod(env, locales.get(), "toLanguageTags", kToString);
        if (toLanguageTags == nullptr) {
            LogPrint(kLogDebug, kTag, "LocaleList cannot find 'toLanguageTags' method id");
        } else {
            LocalRef<jstring> tags(env, static_cast<jstring>(java.Object(locales.get(), toLanguageTags)));
            Jni::Utf8Chars chars(env, tags.get());
            if (chars.get() != nullptr) native.localeListId = Platform::RegisterLocaleList(chars.get());
        }
    }

    LocalRef<jobject> align(env, java.Object(paint, m[kGetTextAlign]));
    if (align) {
        jmethodID name = Jni::FindMethod(env, align.get(), "name", kToString);
        if (name == nullptr) {
            LogPrint(kLogDebug, kTag, "Paint.Align cannot find 'name' method id");
        } else {
            LocalRef<jstring> text(env, static_cast<jstring>(java.Object(align.get(), name)));
            Jni::Utf8Chars chars(env, text.get());
            if (chars.get() != nullptr) {
                std::string value = chars.get();
                native.align = value == "LEFT"    ? Platform::Paint::kAlignLeft
                               : value == "RIGHT" ? Platform::Paint::kAlignRight
                                                  : Platform::Paint::kAlignCenter;
            }
        }
    }

    if (java.Failed()) return JNI_FALSE;
    // The colour is deliberately not taken: the text colour is the view's.
    object->SetPaint(native);
    return JNI_TRUE;
}

jboolean GxText_SetView(JNIEnv* env, jobject thiz, jobject view) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    if (view == nullptr) {
        LogPrint(kLogError, kTag, "GxText_SetView - view is NULL");
        return JNI_FALSE;
    }
    LocalRef<jclass> cls = ClassOf(env, view);
    jmethodID m[kViewMethods];
    if (!Jni::LookUpMethods(env, cls.get(), kViewSpecs, kViewMethods, m, kTag,
                            "GxText_SetView - Function %s not found")) {
        return JNI_FALSE;
    }
    GxView* nativeView = object->GetView();
    if (nativeView == nullptr) return JNI_FALSE;

    JavaCalls java(env, kTag, "GxText_SetView");
    jint gravity = java.Int(view, m[kGetGravity]);
    jint maxLines = java.Int(view, m[kGetMaxLines]);
    jint left = java.Int(view, m[kGetPaddingLeft]);
    jint top = java.Int(view, m[kGetPaddingTop]);
    jint right = java.Int(view, m[kGetPaddingRight]);
    jint bottom = java.Int(view, m[kGetPaddingBottom]);
    jint width = java.Int(view, m[kGetWidth]);
    jint height = java.Int(view, m[kGetHeight]);
    jint color = java.Int(view, m[kGetCurrentTextColor]);
    if (java.Failed()) return JNI_FALSE;

    nativeView->gravity = gravity;
    nativeView->maxLines = maxLines;
    object->SetTextColor(uint32_t(color));
    nativeView->SetPadding(left, top, right, bottom);
    nativeView->SetSize(width, height);

    LocalRef<jobject> typeface(env, java.Object(view, m[kGetTypeface]));
    if (java.Failed()) return JNI_FALSE;
    if (!typeface) return JNI_TRUE;  // the style bits stay as they were
    jmethodID isBold = Jni::FindMethod(env, typeface.get(), "isBold", "()Z");
    if (isBold == nullptr) LogPrint(kLogDebug, kTag, "getTypeFace cannot find 'isBold' method id");
    jmethodID isItalic = Jni::FindMethod(env, typeface.get(), "isItalic", "()Z");
    if (isItalic == nullptr) LogPrint(kLogDebug, kTag, "getTypeFace cannot find 'isItalic' method id");
    bool bold = isBold != nullptr && java.Boolean(typeface.get(), isBold);
    bool italic = isItalic != nullptr && java.Boolean(typeface.get(), isItalic);
    if (java.Failed()) return JNI_FALSE;
    object->SetTextStyle(bold, italic);
    return JNI_TRUE;
}

jboolean GxText_SetLine(JNIEnv* env, jobject thiz, jint lines) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    GxView* view = object->GetView();
    if (view == nullptr) return JNI_FALSE;
    view->lineLimit = lines;
    return JNI_TRUE;
}

jboolean GxText_SetLayout(JNIEnv* env, jobject thiz, jobject layout) {
    GxTextObject* object = Bridge::RequireBoundTextObject(env, thiz);
    if (object == nullptr) return JNI_FALSE;
    if (layout == nullptr) {
        LogPrint(kLogDebug, kTag, "GxText_SetLayout - RH(%d) null", object->GetRuntimeHandle());
        return JNI_FALSE;
    }
    LogPrint(kLogDebug, kTag, "GxText_SetLayout - RH(%d) (%p)", object->GetRuntimeHandle(),
             static_cast<void*>(layout));
    LocalRef<jclass> cls = ClassOf(env, layout);
    jmethodID m[kLayoutMethods];
    if (!Jni::LookUpMethods(env, cls.get(), kLayoutSpecs, kLayoutMethods, m, kTag,
                            "GxText_SetLayout - Function %s not found")) {
        return JNI_FALSE;
    }
    GxView* view = object->GetView();
    if (view == nullptr) return JNI_FALSE;
    JavaCalls java(env, kTag, "GxText_SetLayout");

    // The text, and its background colour.
    LocalRef<jobject> text(env, java.Object(layout, m[kGetText]));
    jstring textString = nullptr;
    if (text) {
        jmethodID toString = Jni::FindMethod(env, text.get(), "toString", kToString);
        if (toString == nullptr) {
            LogPrint(kLogDebug, kTag, "getText cannot find 'toString' method id");
        } else {
            textString = static_cast<jstring>(java.Object(text.get(), toString));
        }
    }
    LocalRef<jstring> string(env, textString);
    jint length = string ? env->GetStringLength(string.get()) : 0;
    // The text is taken whole or the call fails before anything changes. The
    // core's strings end at U+0000, so a text holding it cannot be taken: a
    // text cut short (or the old one kept beside the new lines) would draw
    // something the caller never asked for.
    GxString value;
    bool haveText = false;
    if (string) {
        Jni::Utf8Chars chars(env, string.get());
        if (chars.get() != nullptr) {
            if (!value.Construct(chars.get())) {
                Error::SetReason("the text cannot be taken (it holds U+0000 or is not valid UTF-16)");
                LogPrint(kLogError, kTag, "GxText_SetLayout - RH(%d) text not taken", object->GetRuntimeHandle());
                return JNI_FALSE;
            }
            haveText = true;
        }
    }
    jint background = 0;
    bool hasBackground = FindBackgroundColor(env, java, text.get(), length, &background);

    // The lines shown, and where the first baseline goes.
    jint count = java.Int(layout, m[kGetLineCount]);
    int64_t shown = 0;
    if (view->lineLimit >= 1) {
        shown = std::min(count, view->lineLimit);
    } else if (view->maxLines >= 1) {
        shown = std::min(count, view->maxLines);
    }
    const int gravity = view->gravity & GxView::kGravityVerticalMask;
    const bool bottomGravity = gravity == GxView::kGravityBottom;
    int64_t first = 0;
    int64_t y = 0;
    int64_t previous = 0;
    if (shown >= 1) {
        const int64_t baseline0 = java.Int(layout, m[kGetLineBaseline], jint(0));
        java.Int(layout, m[kGetLineBaseline], jint(count - 1));  // read and not used, as always
        const int64_t lastBottom = java.Int(layout, m[kGetLineBottom], jint(count - 1));
        const int64_t shownBottom = java.Int(layout, m[kGetLineBottom], jint(shown - 1));
        const int64_t paddingTop = view->GetPaddingTop();
        const int64_t paddingBottom = view->GetPaddingBottom();
        const int64_t height = view->GetHeight();
        if (gravity == GxView::kGravityCenterVertical || gravity == GxView::kGravityFillVertical) {
            int32_t available = Wrap(height - paddingTop - paddingBottom);
            y = Wrap(paddingTop + baseline0);
            if (available > shownBottom) y = Wrap(y + Wrap(available - shownBottom) / 2);
        } else if (bottomGravity) {
            y = Wrap(baseline0 - lastBottom + height - paddingBottom);
        } else {
            y = Wrap(paddingTop + baseline0);
        }
        previous = baseline0;
        if (bottomGravity) {
            first = count - shown;
            if (first >= 1) {
                previous = java.Int(layout, m[kGetLineBaseline], jint(first - 1));
                y = Wrap(y - baseline0 + previous);
            }
        }
    }

    auto* lines = new (std::nothrow) List();
    if (lines == nullptr || !lines->Construct()) {
        delete lines;
        return JNI_FALSE;
    }
    const int64_t paddingLeft = view->GetPaddingLeft();
    for (int64_t i = 0; i < shown && !java.Failed(); ++i) {
        const jint line = jint(first + i);
        jint start = java.Int(layout, m[kGetLineStart], line);
        jint end = java.Int(layout, m[kGetLineVisibleEnd], line);
        jint baseline = java.Int(layout, m[kGetLineBaseline], line);
        jfloat left = java.Float(layout, m[kGetLineLeft], line);
        jfloat width = java.Float(layout, m[kGetLineWidth], line);
        jint ascent = java.Int(layout, m[kGetLineAscent], line);
        jint descent = java.Int(layout, m[kGetLineDescent], line);
        y = Wrap(y + Wrap(int64_t(baseline) - previous));
        previous = baseline;

        auto* record = new (std::nothrow) GxLineInfo();
        if (record == nullptr) continue;
        record->x = Wrap(paddingLeft + TruncateToInt(left));
        record->baseline = int32_t(y);
        record->start = start;
        record->end = end;
        record->direction = 1;
        record->bounds = GxRect(record->x, Wrap(y + ascent), Wrap(int64_t(record->x) + TruncateToInt(width)),
                                Wrap(y + descent));
        if (!lines->Add(record)) delete record;
    }
    if (java.Failed()) {
        DeleteLines(lines);
        delete lines;
        return JNI_FALSE;
    }

    // All read: now the object changes. Setting the text may load the font
    // families of its scripts.
    {
        std::unique_lock<std::shared_mutex> fonts(Bridge::FontStateLock());
        if (haveText) object->SetText(&value);
    }
    object->SetBackgroundColor(uint32_t(background), hasBackground);
    if (!object->SetLineInfo(lines)) {
        // Records the object did not take are still ours.
        List* taken = object->GetLineInfo();
        int records = lines->GetCount();
        for (int i = 0; i < records; ++i) {
            void* record = lines->Get(i);
            if (taken == nullptr || !taken->IsContained(record)) delete static_cast<GxLineInfo*>(record);
        }
    }
    lines->RemoveAll();
    delete lines;
    return JNI_TRUE;
}

}  // namespace Glimmer
