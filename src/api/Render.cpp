// render(): a public Text through the core's text object.
//
// Checks first: every field in its range, the content well-formed UTF-8, every
// effect well-formed; nothing reaches the core before that. Then, under the
// core lock, one text object is filled the way the Java bridge fills one: the
// font, the paint, the text (which registers the locales of its scripts, so
// the fallback families it needs get loaded), the view (gravity, text colour,
// padding, size), the background, the line records, the effects and the fill
// opacity, and finally the render into a bitmap as large as the view plus
// the effect stack's four margins.
//
// Line layout is done here, not by a platform: lines are measured with the
// same paint, families and shaping the glyph drawing uses, so a line never
// comes out wider than it was measured. A view without a size gets the size of
// the lines shown, as a wrap_content TextView would, widened on the right when
// slanted or emboldened ink reaches past a line's advance.
//
// Layer style (the default) switches the stack to its work-image mode and adds
// the effects in the canonical order; the exact mode adds them as given and
// leaves the stack's mode to the stack.

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstring>
#include <memory>
#include <new>
#include <vector>

#include "api/CoreAccess.h"
#include "api/EffectLayers.h"
#include "api/FontData.h"
#include "api/LineLayout.h"
#include "api/TextUnits.h"
#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "platform/TextLayout.h"
#include "text/GxFontDrawing.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace glimmer {
namespace detail {
namespace {

Status Invalid(std::string message) { return Status(ErrorCode::kInvalidArgument, std::move(message)); }

bool Within(float value, float low, float high) { return std::isfinite(value) && value >= low && value <= high; }

Status CheckSettings(const Text& text) {
    const TextStyle& s = text.style;
    const Layout& l = text.layout;
    if (text.font.empty()) return Invalid("no font: set the text's font");
    if (text.content.empty()) return Invalid("the text is empty");
    if (!Within(s.size, 1.0f, kMaxTextSize)) return Invalid("the text size must lie in 1..2048 pixels per em");
    if (!Within(s.scaleX, 0.0f, 10.0f) || s.scaleX == 0.0f) return Invalid("scaleX must lie in (0, 10]");
    if (!Within(s.skewX, -2.0f, 2.0f)) return Invalid("skewX must lie in -2..2");
    if (!Within(s.letterSpacing, -10.0f, 10.0f)) return Invalid("letterSpacing must lie in -10..10 ems");
    if (!std::isfinite(s.fillOpacity)) return Invalid("fillOpacity is not a finite number");
    if (l.width < 0 || l.width > kMaxSide || l.height < 0 || l.height > kMaxSide) {
        return Invalid("the layout's width and height must lie in 0..32767");
    }
    for (int p : {l.padding.left, l.padding.top, l.padding.right, l.padding.bottom}) {
        if (p < 0 || p > kMaxSide) return Invalid("the layout's padding must lie in 0..32767");
    }
    if (!std::isfinite(l.wrapWidth) || l.wrapWidth > float(kMaxSide)) {
        return Invalid("wrapWidth must be a number up to 32767");
    }
    if (l.firstLine < 0 || l.maxLines < 0) return Invalid("firstLine and maxLines must not be negative");
    if (int(l.align) < 0 || int(l.align) > int(Align::kRight)) return Invalid("unknown alignment");
    if (int(l.gravity) < 0 || int(l.gravity) > int(Gravity::kBottom)) return Invalid("unknown gravity");
    for (const Effect& effect : text.effects) {
        Status status = CheckEffect(effect);
        if (!status.ok()) return status;
    }
    return Status();
}

Glimmer::Platform::Paint MakePaint(const TextStyle& s) {
    using Glimmer::Platform::Paint;
    Paint paint;
    paint.scaleX = s.scaleX;
    paint.skewX = s.skewX;
    paint.size = s.size;
    paint.embolden = s.fakeBold;
    paint.letterSpacing = s.letterSpacing;
    paint.familyVariant = s.elegant ? Paint::kVariantElegant : Paint::kVariantDefault;
    uint32_t flags = 0;
    if (s.antiAlias) flags |= Paint::kAntiAliasFlag;
    if (s.fakeBold) flags |= Paint::kFakeBoldTextFlag;
    if (s.subpixel) flags |= Paint::kSubpixelTextFlag;
    paint.SetJavaFlags(flags);
    paint.fontFeatureSettings = s.features;
    if (!s.locale.empty()) paint.localeListId = Glimmer::Platform::RegisterLocaleList(s.locale.c_str());
    paint.align = Paint::kAlignLeft;
    return paint;
}

// Measures lines exactly as the glyph drawing will lay them out: the same
// paint, families, direction and context (from the last line break before
// the line).
class Measurer {
public:
    Measurer(Glimmer::GxTextObject* text, const std::u16string& utf16) : utf16_(utf16) {
        paint_ = text->GetPaint();
        int weight = 400;
        Glimmer::Platform::FontFamilies families;
        const Glimmer::GxFontDrawing* drawing = text->GetFont();
        Glimmer::FontManager::GetInstance()->GetMinikinFontFamilies(
            families, drawing != nullptr ? drawing->GetFontPath() : nullptr, &weight);
        typeface_ = Glimmer::Platform::CreateTypefaceFromFamilies(families, weight, text->isItalicTextStyle());
        typeface_->systemFallback = Glimmer::FontManager::GetInstance()->IsSystemFontFamiliesAlreadySet();
        for (size_t at = 1; at < utf16.size(); ++at) {
            if (utf16[at] == 10 || utf16[at] == 13) breaks_.push_back(at);
        }
    }

    float operator()(size_t start, size_t end) const { return LayOut(start, end, false).advance; }

    // How far the line's mask reaches from its pen: its ink box's width,
    // which a slant or fake bold can make larger than the advance.
    float InkWidth(size_t start, size_t end) const {
        const Glimmer::Platform::Layout layout = LayOut(start, end, true);
        return layout.bounds.IsEmpty() ? 0.0f : layout.bounds.right - layout.bounds.left;
    }

private:
    Glimmer::Platform::Layout LayOut(size_t start, size_t end, bool inkBounds) const {
        Glimmer::Platform::Layout layout;
        if (typeface_ == nullptr || end <= start) return layout;
        // The last line break at or before `start` (never index 0), looked up
        // rather than scanned for, so measuring a long paragraph stays linear.
        size_t contextStart = 0;
        const auto after = std::upper_bound(breaks_.begin(), breaks_.end(), start);
        if (after != breaks_.begin()) contextStart = *(after - 1);
        const auto* units = reinterpret_cast<const uint16_t*>(utf16_.data());
        Glimmer::Platform::LayoutText(paint_, Glimmer::Platform::Bidi::kDefaultLtr, *typeface_, units, utf16_.size(),
                                      start, end - start, contextStart, end - contextStart, &layout, inkBounds);
        return layout;
    }

    const std::u16string& utf16_;
    std::vector<size_t> breaks_;  // positions >= 1 of '\n' and '\r', ascending
    Glimmer::Platform::Paint paint_;
    std::shared_ptr<Glimmer::Platform::Typeface> typeface_;
};

int ClampSide(double value) { return int(std::clamp(value, 0.0, double(INT_MAX))); }

int GravityBits(const Layout& layout) {
    using Glimmer::GxView;
    const int horizontal = layout.align == Align::kCenter  ? 0x01
                           : layout.align == Align::kRight ? GxView::kGravityRight
                                                           : GxView::kGravityLeft;
    const int vertical = layout.gravity == Gravity::kCenter   ? GxView::kGravityCenterVertical
                         : layout.gravity == Gravity::kBottom ? GxView::kGravityBottom
                                                              : GxView::kGravityTop;
    return horizontal | vertical;
}

std::string Size(int64_t width, int64_t height) { return std::to_string(width) + "x" + std::to_string(height); }

// The engine's key, every record's letter followed by its bytes in hex,
// records separated by spaces.
std::string PrintableKey(const char* key) {
    std::string out;
    if (key == nullptr) return out;
    static const char kHex[] = "0123456789ABCDEF";
    for (const unsigned char* p = reinterpret_cast<const unsigned char*>(key); *p != 0; ++p) {
        if (*p < 0x80) {
            if (!out.empty()) out += ' ';
            out += char(*p);
        } else {
            out += kHex[*p >> 4];
            out += kHex[*p & 15];
        }
    }
    return out;
}

struct TextObjectDeleter {
    void operator()(Glimmer::GxTextObject* text) const { delete text; }
};

// The part of a render that works on the core; call with the core lock held.
Result<Picture> RenderLocked(const Text& request, const RenderOptions& options, const TextUnits& units) {
    const FontData& font = *FontAccess::Data(request.font);
    const TextStyle& style = request.style;
    const Layout& layout = request.layout;

    std::unique_ptr<Glimmer::GxTextObject, TextObjectDeleter> text(new (std::nothrow) Glimmer::GxTextObject());
    if (text == nullptr || !text->Construct()) return Status(ErrorCode::kOutOfMemory, "out of memory for the text");
    // The store has the font under its key since the handle was made.
    if (!text->SetFont(font.key.c_str())) {
        return Status(ErrorCode::kInternal, "the font '" + font.key + "' is no longer usable");
    }
    Glimmer::Platform::Paint paint = MakePaint(style);
    text->SetPaint(paint);
    text->SetTextStyle(false, style.italic);
    if (!text->SetText(units.codePoints.c_str())) return Status(ErrorCode::kOutOfMemory, "out of memory for the text");
    if (text->GetText()->GetUTF16Size() != int(units.utf16.size()) + 1) {
        return Status(ErrorCode::kInternal, "the text object counts the text differently");
    }

    // The lines, and which of them are shown.
    const Measurer measure(text.get(), units.utf16);
    const int contentWidth = std::max(0, layout.width - layout.padding.left - layout.padding.right);
    float wrap = layout.wrapWidth;
    if (wrap < 0.0f) wrap = layout.width > 0 ? float(contentWidth) : 0.0f;
    if (layout.width > 0 && wrap > 0.0f) wrap = std::min(wrap, float(std::max(contentWidth, 1)));
    std::vector<LayoutLine> lines =
        BreakLines(units.utf16, [&](size_t s, size_t e) { return measure(s, e); }, wrap);
    if (size_t(layout.firstLine) >= lines.size()) {
        return Status(ErrorCode::kLineRange, "line " + std::to_string(layout.firstLine) +
                                                 " lies past the text's last line (it has " +
                                                 std::to_string(lines.size()) + ", counted from 0)");
    }
    const size_t first = size_t(layout.firstLine);
    const size_t shown = layout.maxLines > 0 ? std::min(lines.size() - first, size_t(layout.maxLines))
                                             : lines.size() - first;
    float widest = 0.0f;
    for (size_t i = first; i < first + shown; ++i) widest = std::max(widest, lines[i].width);
    const int layoutWidth = layout.width > 0 ? contentWidth : ClampSide(std::ceil(double(widest)));
    PlaceLines(&lines, font.ExtentAt(style.size), layout.fontPadding, layoutWidth, layout.align);

    ViewGeometry view;
    view.padding = layout.padding;
    view.gravity = layout.gravity;
    view.first = int(first);
    view.count = int(shown);
    view.width = layout.width > 0 ? layout.width : layoutWidth + layout.padding.left + layout.padding.right;
    if (layout.width <= 0) {
        // A view that fits the text also fits ink that leans or swells past
        // the advance, so that nothing is cut at its right edge.
        double inkRight = 0.0;
        for (size_t i = first; i < first + shown; ++i) {
            const LayoutLine& line = lines[i];
            if (line.visibleEnd <= line.start) continue;
            const float ink = measure.InkWidth(size_t(line.start), size_t(line.visibleEnd));
            if (ink > line.width) inkRight = std::max(inkRight, double(line.left) + std::ceil(double(ink)) + 1.0);
        }
        if (inkRight > double(layoutWidth)) view.width += ClampSide(std::ceil(inkRight)) - layoutWidth;
    }
    view.height = layout.height > 0 ? layout.height
                                    : lines[first + shown - 1].bottom - lines[first].top + layout.padding.top +
                                          layout.padding.bottom;
    if (view.width > kMaxSide || view.height > kMaxSide) {
        return Status(ErrorCode::kTooLarge,
                      "the view would be " + Size(view.width, view.height) + " pixels; at most 32767 a side");
    }

    // The view, the background and the line records, as the bridge hands them over.
    Glimmer::GxView* gxView = text->GetView();
    if (gxView == nullptr) return Status(ErrorCode::kOutOfMemory, "out of memory for the view");
    gxView->gravity = GravityBits(layout);
    text->SetTextColor(style.color);
    gxView->SetPadding(layout.padding.left, layout.padding.top, layout.padding.right, layout.padding.bottom);
    gxView->SetSize(view.width, view.height);
    text->SetBackgroundColor(style.background, style.background != 0);
    const std::vector<Glimmer::GxLineInfo> records = MakeLineRecords(lines, view);
    {
        Glimmer::List list;
        list.Construct();
        for (const Glimmer::GxLineInfo& line : records) {
            auto* copy = new (std::nothrow) Glimmer::GxLineInfo(line);
            if (copy == nullptr || !list.Add(copy)) {
                delete copy;
                for (int i = 0; i < list.GetCount(); ++i) delete static_cast<Glimmer::GxLineInfo*>(list.Get(i));
                return Status(ErrorCode::kOutOfMemory, "out of memory for the line records");
            }
        }
        if (!text->SetLineInfo(&list)) {
            for (int i = 0; i < list.GetCount(); ++i) delete static_cast<Glimmer::GxLineInfo*>(list.Get(i));
            return Status(ErrorCode::kOutOfMemory, "out of memory for the line records");
        }
        list.RemoveAll();   // the text object owns them now
    }

    // The effects.
    Glimmer::GxEffect* stack = text->GetEffect();
    if (stack == nullptr) return Status(ErrorCode::kOutOfMemory, "out of memory for the effects");
    stack->setLayerStyle(!options.exact);
    stack->setTextOpacity(style.fillOpacity);
    if (options.exact) {
        for (const Effect& effect : request.effects) {
            Status status = AddToStack(effect, stack);
            if (!status.ok()) return status;
        }
    } else {
        for (const Effect* effect : LayerStyleOrder(request.effects)) {
            Status status = AddToStack(*effect, stack);
            if (!status.ok()) return status;
        }
    }

    // The render, into the view plus the margins.
    Picture picture;
    picture.viewWidth = view.width;
    picture.viewHeight = view.height;
    picture.margins = {stack->getLeftOffset(), stack->getTopOffset(), stack->getRightOffset(),
                       stack->getBottomOffset()};
    const Margins& m = picture.margins;
    const int64_t width = int64_t(view.width) + m.left + m.right;
    const int64_t height = int64_t(view.height) + m.top + m.bottom;
    if (width > kMaxSide || height > kMaxSide || width * height > kMaxPixels) {
        return Status(ErrorCode::kTooLarge, "the image would be " + Size(width, height) +
                                                " pixels, more than can be allocated (at most 32767 a side and " +
                                                std::to_string(kMaxPixels) + " pixels)");
    }
    if (width < 1 || height < 1) {
        return Status(ErrorCode::kInvalidArgument,
                      "nothing to draw: the image would be " + Size(width, height) + " pixels");
    }
    gxView->SetBitmapWidth(int(width));
    gxView->SetBitmapHeight(int(height));
    const unsigned* pixels = text->RenderTextEffect(int(width), int(height));
    if (pixels == nullptr) {
        return Status(ErrorCode::kOutOfMemory, "cannot allocate an image of " + Size(width, height) + " pixels");
    }
    picture.image.width = int(width);
    picture.image.height = int(height);
    picture.image.pixels.assign(pixels, pixels + size_t(width) * size_t(height));

    std::unique_ptr<char[]> key(stack->getMapKey(text->GetTextColor()));
    picture.key = PrintableKey(key.get());

    for (const Glimmer::GxLineInfo& record : records) {
        Line line;
        line.begin = units.utf8Offsets[size_t(record.start)];
        line.end = units.utf8Offsets[size_t(record.end)];
        line.x = record.x + m.left;
        line.baseline = record.baseline + m.top;
        line.width = record.bounds.right - record.bounds.left;
        line.top = record.bounds.top + m.top;
        line.bottom = record.bounds.bottom + m.top;
        picture.lines.push_back(line);
    }
    return picture;
}

}  // namespace
}  // namespace detail

Result<Picture> render(const Text& text, const RenderOptions& options) noexcept {
    try {
        Status settings = detail::CheckSettings(text);
        if (!settings.ok()) return settings;
        detail::TextUnits units;
        const std::string problem = detail::DecodeText(text.content, &units);
        if (!problem.empty()) return detail::Invalid(problem);
        if (units.utf16.size() > kMaxTextLength) {
            return detail::Invalid("the text is longer than " + std::to_string(kMaxTextLength) + " UTF-16 units");
        }
        if (units.utf16.empty()) return detail::Invalid("the text is empty");
        auto lock = detail::LockCore();
        detail::EnsureSystemFonts();
        return detail::RenderLocked(text, options, units);
    } catch (const std::bad_alloc&) {
        return Status(ErrorCode::kOutOfMemory, "out of memory while rendering");
    } catch (...) {
        return Status(ErrorCode::kInternal, "rendering failed inside the library");
    }
}

const char* versionString() noexcept { return GLIMMER_VERSION_STRING; }

}  // namespace glimmer
