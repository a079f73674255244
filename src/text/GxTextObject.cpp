// The text object and its render pass.
//
// Locale registration. Whenever the text changes it is walked by code point
// (a surrogate pair is one code point, a lone surrogate reads as U+FFFD) and
// cut into script runs: a run goes on while the next script is the run's
// own, or while either side is common or inherited (a run that began with
// common or inherited characters takes the first real script it meets). For
// every run one locale list is registered: "ko" for Hangul, "ja" for
// Hiragana and Katakana, "zh-Hans" and then "zh-Hant" for Han, nothing for
// Latin, common and unknown, and "und-" plus the script tag for any other
// script. Each new list id asks the font manager to load the system family
// of that list. Runs are not deduplicated: a script that comes back is
// registered again, which costs a lookup and nothing else.
//
// The render pass. The glyph drawing leaves the effect stack's picture (every
// line through every effect, straight alpha) in a bitmap of the requested
// size. A second bitmap is cleared and clipped to the text area: the padding
// is cut off on every side except the one the text is gravitated to, which
// stays open to the bitmap's edge (deliberately: the effects that reach past
// the text there stay visible). With a background colour, every line's box
// is filled. Both bitmaps are then turned into 0xAARRGGBB words, and the
// effect picture is drawn over the background with source-over inside the
// clip. Without a background that is the effect picture itself inside the
// clip, which is how it is made then (see RenderTextEffect). The line boxes
// are moved by every render (the glyph drawing shifts them by the effects'
// top margin each time): that is how it has always behaved and is kept.

#include "text/GxTextObject.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <mutex>
#include <new>
#include <type_traits>
#include <vector>

#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/Error.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxLog.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/Canvas.h"
#include "platform/LocaleList.h"
#include "platform/Log.h"
#include "platform/Unicode.h"
#include "text/GxFontDrawing.h"
#include "text/GxLineInfo.h"
#include "text/GxTextInstanceManager.h"
#include "text/GxView.h"

namespace Glimmer {
namespace {

constexpr const char* kTag = "GxTextObject";
constexpr uint32_t kStyleBold = 1u << 0;
constexpr uint32_t kStyleItalic = 1u << 1;

void ReleaseGxTextCallback(GxTextObject* object) {
    Platform::LogPrint(Platform::kLogDebug, kTag, "Delete GxTextObject by InstanceManager : %p",
                       static_cast<void*>(object));
    delete object;
}

void ClearLines(List* lines) {
    if (lines == nullptr) return;
    int count = lines->GetCount();
    for (int i = 0; i < count; ++i) delete static_cast<GxLineInfo*>(lines->Get(i));
    lines->RemoveAll();
}

void RegisterLocale(const char* locales) {
    uint32_t id = Platform::RegisterLocaleList(locales);
    if (id != Platform::kEmptyLocaleListId) FontManager::GetInstance()->LoadMinikinFontFamily(id);
}

void RegisterScript(uint32_t script) {
    if (script == Platform::kScriptInherited) script = Platform::kScriptCommon;
    switch (script) {
        case Platform::kScriptInvalid:
        case Platform::kScriptLatin:
        case Platform::kScriptCommon:
        case Platform::kScriptUnknown:
            return;
        case Platform::kScriptHangul:
            RegisterLocale("ko");
            return;
        case Platform::kScriptHiragana:
        case Platform::kScriptKatakana:
            RegisterLocale("ja");
            return;
        case Platform::kScriptHan:
            RegisterLocale("zh-Hans");
            RegisterLocale("zh-Hant");
            return;
        default: {
            char locale[16];
            std::snprintf(locale, sizeof locale, "und-%c%c%c%c", char(script >> 24), char(script >> 16),
                          char(script >> 8), char(script));
            RegisterLocale(locale);
            return;
        }
    }
}

int ClampToInt(int64_t value) { return int(std::clamp<int64_t>(value, INT_MIN, INT_MAX)); }

// A width x height 32-bit image on the pixel block of `*kept` when that is the
// same size (taken out of *kept), else a new one. Zeroed when `zeroed`; a new
// one always is.
GxBitmap* ImageOfSize(GxBitmap** kept, unsigned width, unsigned height, bool zeroed) {
    GxBitmap* image = *kept;
    if (image != nullptr && image->pixels != nullptr && image->width == width && image->height == height &&
        image->bytesPerPixel == 4) {
        *kept = nullptr;
        if (zeroed) std::memset(image->pixels, 0, size_t(width) * height * 4);
        return image;
    }
    return new (std::nothrow) GxBitmap(width, height, 4);
}

bool IsWeakScript(uint32_t script) {
    return script == Platform::kScriptInherited || script == Platform::kScriptCommon;
}

}  // namespace

struct GxTextObjectImpl {
    explicit GxTextObjectImpl(GxTextObject* owner);
    ~GxTextObjectImpl();

    GxTextObject* owner;
    GxString* text = nullptr;
    GxFontDrawing* fontDrawing = nullptr;
    GxEffect* effect = nullptr;
    List* lineInfo = nullptr;
    int32_t runtimeHandle = -1;
    uint32_t textStyle = 0;
    GxBitmap* result = nullptr;
    // The image the next render draws into (see RenderTextEffect).
    GxBitmap* spareImage = nullptr;
    GxView* view = nullptr;
    Platform::Paint paint;
    uint32_t backgroundColor = 0;
    bool hasBackground = false;
    uint32_t textColor = 0xFF000000u;
};

namespace {

// The plain getters: the member once constructed; before that the failure is
// reported with the calling getter's own line and the fallback returned.
template <class T>
T MemberOr(const GxTextObjectImpl* m, T GxTextObjectImpl::*member, std::type_identity_t<T> fallback,
           int line) {
    if (m == nullptr) {
        ReportError(kTag, kErrorNotConstructed, line);
        return fallback;
    }
    return m->*member;
}

}  // namespace

GxTextObjectImpl::GxTextObjectImpl(GxTextObject* owner) : owner(owner) {
    effect = new (std::nothrow) GxEffect();
    fontDrawing = new (std::nothrow) GxFontDrawing();
    lineInfo = new (std::nothrow) List();
    if (lineInfo != nullptr && !lineInfo->Construct()) {
        delete lineInfo;
        lineInfo = nullptr;
    }
    view = new (std::nothrow) GxView();
}

GxTextObjectImpl::~GxTextObjectImpl() {
    delete text;
    ClearLines(lineInfo);
    delete lineInfo;
    delete fontDrawing;
    delete effect;
    delete result;
    delete spareImage;
    delete view;
}

GxTextObject::GxTextObject() {
    // The registry deletes released objects through this callback, installed
    // by the first object of the process.
    static std::once_flag callbackInstalled;
    std::call_once(callbackInstalled, [] { GxTextInstanceManager::SetCallBack(ReleaseGxTextCallback); });
    Platform::LogPrint(Platform::kLogDebug, kTag, "GxTextObject(%p)", static_cast<void*>(this));
}

GxTextObject::~GxTextObject() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }
    Platform::LogPrint(Platform::kLogDebug, kTag, "~GxTextObject(%p / %d)", static_cast<void*>(this),
                       M->runtimeHandle);
    GxTextInstanceManager::Unregister(M->runtimeHandle);
    delete M;
    M = nullptr;
}

bool GxTextObject::Construct() {
    if (M != nullptr) {
        GX_REPORT_ERROR(kTag, kErrorAlreadyConstructed);
        return false;
    }
    M = new (std::nothrow) GxTextObjectImpl(this);
    if (M == nullptr) return false;
    M->runtimeHandle = GxTextInstanceManager::Register(this);
    Platform::LogPrint(Platform::kLogDebug, kTag, "Construct(%p / %d)", static_cast<void*>(this),
                       M->runtimeHandle);
    return true;
}

int GxTextObject::GetRuntimeHandle() const {
    return MemberOr(M, &GxTextObjectImpl::runtimeHandle, -1, __LINE__);
}

GxEffect* GxTextObject::GetEffect() {
    return MemberOr(M, &GxTextObjectImpl::effect, nullptr, __LINE__);
}

GxString* GxTextObject::GetText() {
    return MemberOr(M, &GxTextObjectImpl::text, nullptr, __LINE__);
}

GxFontDrawing* GxTextObject::GetFont() {
    return MemberOr(M, &GxTextObjectImpl::fontDrawing, nullptr, __LINE__);
}

List* GxTextObject::GetLineInfo() {
    return MemberOr(M, &GxTextObjectImpl::lineInfo, nullptr, __LINE__);
}

GxView* GxTextObject::GetView() {
    return MemberOr(M, &GxTextObjectImpl::view, nullptr, __LINE__);
}

Platform::Paint GxTextObject::GetPaint() {
    return MemberOr(M, &GxTextObjectImpl::paint, Platform::Paint(), __LINE__);
}

void GxTextObject::SetPaint(Platform::Paint& paint) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }
    M->paint = paint;
}

bool GxTextObject::SetText(const GxString* text) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (GxLog::IsAllLogEnable()) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "SetText() - %p [%s] strLen=%d",
                           static_cast<void*>(this), GxLog::ConvertLog(text),
                           text != nullptr ? text->GetLength() : 0);
    }
    if (text == nullptr) {
        delete M->text;
        M->text = nullptr;
        return true;
    }
    if (M->text == nullptr) {
        M->text = new (std::nothrow) GxString();
        if (M->text == nullptr) return false;
        M->text->Construct();
    }
    if (!M->text->Set(text)) return false;
    SetTextLocaleListId();
    return true;
}

bool GxTextObject::SetText(const wchar_t* text) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (text == nullptr) {
        delete M->text;
        M->text = nullptr;
        return true;
    }
    if (M->text == nullptr) {
        M->text = new (std::nothrow) GxString();
        if (M->text == nullptr) return false;
        M->text->Construct();
    }
    if (!M->text->Set(text)) return false;
    SetTextLocaleListId();
    return true;
}

void GxTextObject::SetTextLocaleListId() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }
    if (M->text == nullptr) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "SetTextLocaleListId - text is null.");
        return;
    }
    int size = M->text->GetUTF16Size();
    if (size == -1) return;
    uint16_t* units = M->text->GetUTF16();
    if (units == nullptr) {
        Platform::LogPrint(Platform::kLogDebug, kTag, "SetTextLocaleListId - textString is null.");
        return;
    }
    size_t length = size > 0 ? size_t(size - 1) : 0;

    std::vector<uint32_t> scripts;
    scripts.reserve(length);
    for (size_t i = 0; i < length;) {
        uint32_t cp = units[i];
        if ((cp & 0xFC00) == 0xD800 && i + 1 < length && (units[i + 1] & 0xFC00) == 0xDC00) {
            cp = 0x10000 + ((cp - 0xD800) << 10) + (units[i + 1] - 0xDC00u);
            i += 2;
        } else {
            i += 1;
        }
        if ((cp >> 11) == 0x1B) cp = 0xFFFD;
        scripts.push_back(Platform::ScriptOf(cp));
    }
    delete[] units;

    for (size_t i = 0; i < scripts.size();) {
        uint32_t script = scripts[i];
        size_t next = i + 1;
        for (; next < scripts.size(); ++next) {
            uint32_t following = scripts[next];
            if (following == script) continue;
            if (IsWeakScript(script)) {
                script = following;
            } else if (!IsWeakScript(following)) {
                break;
            }
        }
        RegisterScript(script);
        i = next;
    }
}

bool GxTextObject::SetFont(const char* path) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (path == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorInvalidArgument);
        return false;
    }
    Platform::LogPrint(Platform::kLogDebug, kTag, "SetFont(%p) - path[%s]", static_cast<void*>(this), path);
    if (M->fontDrawing == nullptr) {
        M->fontDrawing = new (std::nothrow) GxFontDrawing();
        if (M->fontDrawing == nullptr) return false;
    }
    if (!FontManager::GetInstance()->AddMinikinFont(path, nullptr, 0, 0, true)) return false;
    M->fontDrawing->SetFontPath(path);
    return true;
}

bool GxTextObject::SetFont(const char* path, char* data, unsigned size) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        delete[] data;
        return false;
    }
    if (path == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorInvalidArgument);
        delete[] data;
        return false;
    }
    Platform::LogPrint(Platform::kLogDebug, kTag, "SetFont2(%p) - path[%s] - size: %d",
                       static_cast<void*>(this), path, int(size));
    if (M->fontDrawing == nullptr) {
        M->fontDrawing = new (std::nothrow) GxFontDrawing();
        if (M->fontDrawing == nullptr) {
            delete[] data;
            return false;
        }
    }
    if (!FontManager::GetInstance()->AddMinikinFont(path, data, size, 0, true)) return false;
    M->fontDrawing->SetFontPath(path);
    return true;
}

bool GxTextObject::SetLineInfo(const List* lines) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    if (lines == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "SetLineInfo - lineInfo is NULL");
        GX_REPORT_ERROR(kTag, kErrorInvalidArgument);
        return false;
    }
    if (M->lineInfo == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "SetLineInfo - M->lineInfo is NULL");
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    // Handing the object its own list leaves it empty.
    if (lines == M->lineInfo) {
        ClearLines(M->lineInfo);
        return true;
    }
    ClearLines(M->lineInfo);
    if (lines->GetCount() > 0) return M->lineInfo->Add(lines);
    return true;
}

bool GxTextObject::SetTextStyle(bool bold, bool italic) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    M->textStyle = bold ? (M->textStyle | kStyleBold) : (M->textStyle & ~kStyleBold);
    M->textStyle = italic ? (M->textStyle | kStyleItalic) : (M->textStyle & ~kStyleItalic);
    return true;
}

bool GxTextObject::isBoldTextStyle() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    return (M->textStyle & kStyleBold) != 0;
}

bool GxTextObject::isItalicTextStyle() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return false;
    }
    return (M->textStyle & kStyleItalic) != 0;
}

void GxTextObject::SetBackgroundColor(unsigned color, bool enabled) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }
    M->backgroundColor = color;
    M->hasBackground = enabled;
}

void GxTextObject::SetTextColor(unsigned color) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }
    M->textColor = color;
}

unsigned GxTextObject::GetTextColor() {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return 0xFF000000u;
    }
    return M->textColor;
}

GxTextObject* GxTextObject::FindGxTextObject(int handle) {
    return GxTextInstanceManager::FindGxTextObject(handle);
}

// A line record shows a part of the text; one whose range lies outside it
// was made for another text, and drawing it would give a silently blank line.
// Without a text the drawing pass says so itself.
bool GxTextObject::LinesInsideText() {
    const int length = M->text != nullptr ? M->text->GetUTF16Size() - 1 : 0;
    const int count = M->lineInfo != nullptr && length >= 1 ? M->lineInfo->GetCount() : 0;
    for (int i = 0; i < count; ++i) {
        const auto* line = static_cast<const GxLineInfo*>(M->lineInfo->Get(i));
        if (line == nullptr || (line->start >= 0 && line->start <= line->end && line->end <= length)) continue;
        Platform::LogPrint(Platform::kLogError, kTag,
                           "RenderTextEffect(%p) - line %d [%d, %d) lies outside the text of %d units",
                           static_cast<void*>(this), i, int(line->start), int(line->end), length);
        GX_REPORT_ERROR(kTag, kErrorInvalidArgument);
        Error::SetReason("line %d shows units [%d, %d) of a text of %d", i, int(line->start), int(line->end),
                         length);
        return false;
    }
    return true;
}

unsigned* GxTextObject::RenderTextEffect(int width, int height) {
    if (M == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return nullptr;
    }
    Platform::LogPrint(Platform::kLogDebug, kTag, "RenderTextEffect(%p / %d) >>> Start! - (w=%d,h=%d)",
                       static_cast<void*>(this), M->runtimeHandle, width, height);
    if (width < 0 || height < 0) {
        GX_REPORT_ERROR(kTag, kErrorInvalidArgument);
        return nullptr;
    }
    if (M->fontDrawing == nullptr) {
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return M->result != nullptr ? reinterpret_cast<unsigned*>(M->result->pixels) : nullptr;
    }
    if (!LinesInsideText()) return nullptr;

    // Two images take turns, so a render allocates nothing once the size is
    // known and never hands out the previous result's pixels again (they were
    // promised until this render only). The stack leaves the effect picture
    // in word order. Without background boxes the cleared result would take
    // it as it is inside the clip (source-over onto transparent black copies a
    // pixel exactly, and the stack leaves its transparent pixels all 0), so
    // the effect picture becomes the result in place and the pixels outside
    // the clip are cleared. With boxes a second image takes the background
    // and the effect picture is drawn over it.
    const bool boxes = M->hasBackground && M->lineInfo != nullptr && M->lineInfo->GetCount() > 0;
    // An image too large to hold is refused before anything is drawn: the
    // line masks and the effects' work images would be had (and filled) in
    // vain. The last picture stays as it was.
    size_t imageBytes = 0;
    if (!GxBitmap::PixelBytes(unsigned(width), unsigned(height), 4, &imageBytes)) {
        Error::SetReason("a %d x %d picture is too large to hold", width, height);
        Platform::LogPrint(Platform::kLogError, kTag, "RenderTextEffect(%p) - %d x %d is too large",
                           static_cast<void*>(this), width, height);
        Error::SetError(kErrorInvalidArgument);
        return nullptr;
    }
    GxBitmap* effectBitmap =
        ImageOfSize(boxes ? &M->result : &M->spareImage, unsigned(width), unsigned(height), true);
    if (effectBitmap == nullptr) return nullptr;
    if (effectBitmap->pixels == nullptr) {   // out of memory: nothing to draw into
        delete effectBitmap;
        Error::SetReason("no memory for a %d x %d picture", width, height);
        Error::SetError(kErrorSystemCall);
        return nullptr;
    }

    if (M->effect != nullptr) M->effect->setWordOrderOutput(true);
    M->fontDrawing->DrawTextEffect(this, effectBitmap);
    if (M->effect != nullptr) M->effect->setWordOrderOutput(false);

    auto clipToText = [&](Platform::Canvas& canvas) {
        const GxView* view = M->view;
        if (view == nullptr) return;
        int horizontal = view->gravity & GxView::kGravityHorizontalMask;
        int vertical = view->gravity & GxView::kGravityVerticalMask;
        int64_t bitmapWidth = view->GetBitmapWidth();
        int64_t bitmapHeight = view->GetBitmapHeight();
        int left = horizontal == GxView::kGravityLeft ? 0 : view->GetPaddingLeft();
        int right = ClampToInt(horizontal == GxView::kGravityRight ? bitmapWidth
                                                                    : bitmapWidth - view->GetPaddingRight());
        int top = vertical == GxView::kGravityTop ? 0 : view->GetPaddingTop();
        int bottom = ClampToInt(vertical == GxView::kGravityBottom ? bitmapHeight
                                                                    : bitmapHeight - view->GetPaddingBottom());
        canvas.ClipRect(left, top, right, bottom);
    };

    GxBitmap* result = effectBitmap;
    if (!boxes) {
        Platform::Canvas canvas(effectBitmap->pixels, width, height);
        clipToText(canvas);
        canvas.ClearOutsideClip();
        delete M->spareImage;
        M->spareImage = M->result;
    } else {
        result = ImageOfSize(&M->spareImage, unsigned(width), unsigned(height), false);
        if (result == nullptr) {
            delete effectBitmap;
            return nullptr;
        }
        // A bitmap whose pixels could not be had draws nothing.
        bool drawable = result->pixels != nullptr && effectBitmap->pixels != nullptr;
        Platform::Canvas canvas(drawable ? result->pixels : nullptr, width, height);
        canvas.Clear();
        // Both images are in word order (the effect picture from the stack,
        // the boxes by their colour with red and blue swapped): the canvas
        // treats the three colour bytes alike, so no conversion pass is needed.
        const uint32_t c = M->backgroundColor;
        const uint32_t inWordOrder = (c & 0xFF00FF00u) | (c & 0xFFu) << 16 | (c >> 16 & 0xFFu);
        clipToText(canvas);
        int count = M->lineInfo->GetCount();
        for (int i = 0; i < count; ++i) {
            const auto* line = static_cast<const GxLineInfo*>(M->lineInfo->Get(i));
            if (line == nullptr) continue;
            canvas.FillRect(float(line->bounds.left), float(line->bounds.top), float(line->bounds.right),
                            float(line->bounds.bottom), inWordOrder);
        }
        if (drawable) canvas.DrawImage(effectBitmap->pixels, width, height, 0, 0);
        delete M->spareImage;
        M->spareImage = effectBitmap;
        delete M->result;  // null when it became the effect image
    }
    M->result = result;
    Platform::LogPrint(Platform::kLogDebug, kTag, "RenderTextEffect(%p / %d) <<< End.",
                       static_cast<void*>(this), M->runtimeHandle);
    return reinterpret_cast<unsigned*>(result->pixels);
}

}  // namespace Glimmer
