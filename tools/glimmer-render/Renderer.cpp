// Driving a text object as the Java bridge does.
//
// The order of the calls is the bridge's: the font, the paint (built field by
// field as the paint native builds it), the text (which registers the
// locales of its scripts, so the fallback families it needs get loaded), the
// view (gravity, maximum lines, text colour, padding, size), the line limit,
// the line records, the effects, and finally the render with a bitmap as
// large as the view plus the effect stack's four margins.
//
// What a device's layout would supply is made here: the lines are measured
// with the same shaping and the same font families the glyph drawing uses,
// so that a line never comes out wider than it was measured. A view without
// a size gets the size of its text, as a wrap_content TextView would.

#include "Renderer.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <memory>
#include <mutex>

#include "BundledFont.h"
#include "Values.h"
#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "font/SystemFontFamilies.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "platform/TextLayout.h"
#include "text/GxFontDrawing.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace Glimmer::RenderTool {
namespace {

void Check(bool ok, const std::string& message) {
    if (!ok) throw UsageError(message);
}

void Validate(const RenderRequest& r) {
    Check(r.size >= 1.0f && r.size <= Limits::kMaxTextSize, "--size must lie in 1..2048 pixels");
    Check(r.width >= 0 && r.width <= Limits::kMaxSide, "--width must lie in 0..32767");
    Check(r.height >= 0 && r.height <= Limits::kMaxSide, "--height must lie in 0..32767");
    for (int p : r.padding) Check(p >= 0 && p <= Limits::kMaxSide, "--padding must lie in 0..32767");
    Check(r.wrap <= float(Limits::kMaxSide), "--wrap must lie in 0..32767");
    Check(r.maxLines >= 0, "--max-lines must not be negative");
    Check(r.lineLimit >= 0, "--line-limit must not be negative");
    Check(std::isfinite(r.scaleX) && r.scaleX > 0.0f && r.scaleX <= 10.0f, "--scale-x must lie in (0, 10]");
    Check(std::isfinite(r.skewX) && std::fabs(r.skewX) <= 2.0f, "--skew-x must lie in -2..2");
    Check(std::isfinite(r.letterSpacing) && std::fabs(r.letterSpacing) <= 10.0f,
          "--letter-spacing must lie in -10..10 ems");
    Check(!r.text.empty(), "the text is empty");
    Check(r.text.size() <= Limits::kMaxTextLength * 4, "the text is longer than 100000 characters");
}

std::string WithoutCarriageReturns(const std::string& text) {
    std::string out;
    out.reserve(text.size());
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\r' && i + 1 < text.size() && text[i + 1] == '\n') continue;
        out += text[i];
    }
    return out;
}

// The system's families are handed to the font manager once per process,
// as the font natives do when the library loads.
void InstallSystemFonts() {
    static std::once_flag once;
    std::call_once(once, [] { InstallSystemFontFamilies(); });
}

// Sets the font and returns its bytes for the vertical metrics.
std::vector<char> SetFont(GxTextObject* text, const std::string& path) {
    if (path.empty()) {
        const std::string_view font = BundledFont();
        char* data = new char[font.size()];
        std::memcpy(data, font.data(), font.size());
        if (!text->SetFont(kBundledFontKey, data, unsigned(font.size()))) {
            throw RenderError("the bundled font cannot be loaded");
        }
        return std::vector<char>(font.begin(), font.end());
    }
    std::vector<char> bytes = ReadFileBytes(path, "--font");
    if (!text->SetFont(path.c_str())) {
        throw RenderError("--font: '" + path + "' is not a font the library can read");
    }
    return bytes;
}

Platform::Paint MakePaint(const RenderRequest& r) {
    Platform::Paint paint;
    paint.scaleX = r.scaleX;
    paint.skewX = r.skewX;
    paint.size = r.size;
    paint.embolden = r.fakeBold;
    paint.letterSpacing = r.letterSpacing;
    paint.familyVariant = r.elegant ? Platform::Paint::kVariantElegant : Platform::Paint::kVariantDefault;
    uint32_t flags = 0;
    if (r.antiAlias) flags |= Platform::Paint::kAntiAliasFlag;
    if (r.fakeBold) flags |= Platform::Paint::kFakeBoldTextFlag;
    if (r.subpixel) flags |= Platform::Paint::kSubpixelTextFlag;
    paint.SetJavaFlags(flags);
    paint.fontFeatureSettings = r.features;
    if (!r.locale.empty()) paint.localeListId = Platform::RegisterLocaleList(r.locale.c_str());
    paint.align = Platform::Paint::kAlignLeft;
    return paint;
}

// Measures lines exactly as the glyph drawing will lay them out: the same
// paint, families, direction and context (from the last line break before
// the line).
class Measurer {
public:
    Measurer(GxTextObject* text, const std::u16string& utf16) : utf16_(utf16) {
        paint_ = text->GetPaint();
        int weight = 400;
        Platform::FontFamilies families;
        const GxFontDrawing* drawing = text->GetFont();
        FontManager::GetInstance()->GetMinikinFontFamilies(
            families, drawing != nullptr ? drawing->GetFontPath() : nullptr, &weight);
        typeface_ = Platform::CreateTypefaceFromFamilies(families, weight, text->isItalicTextStyle());
    }

    float operator()(size_t start, size_t end) const {
        if (typeface_ == nullptr || end <= start) return 0.0f;
        size_t contextStart = 0;
        for (size_t at = start; at >= 1; --at) {
            if (at < utf16_.size() && (utf16_[at] == 10 || utf16_[at] == 13)) {
                contextStart = at;
                break;
            }
        }
        const auto* units = reinterpret_cast<const uint16_t*>(utf16_.data());
        Platform::Layout layout;
        Platform::LayoutText(paint_, Platform::Bidi::kDefaultLtr, *typeface_, units, utf16_.size(), start,
                             end - start, contextStart, end - contextStart, &layout);
        return layout.advance;
    }

private:
    const std::u16string& utf16_;
    Platform::Paint paint_;
    std::shared_ptr<Platform::Typeface> typeface_;
};

struct TextObjectDeleter {
    void operator()(GxTextObject* text) const { delete text; }
};

int ClampSide(double value) { return int(std::clamp(value, 0.0, double(INT_MAX))); }

}  // namespace

RenderResult Render(const RenderRequest& request) {
    Validate(request);
    InstallSystemFonts();

    std::unique_ptr<GxTextObject, TextObjectDeleter> text(new GxTextObject());
    if (!text->Construct()) throw RenderError("out of memory for the text object");

    const std::vector<char> fontBytes = SetFont(text.get(), request.fontPath);
    const FontExtent extent = MeasureFontExtent(fontBytes.data(), fontBytes.size(), request.size);

    Platform::Paint paint = MakePaint(request);
    text->SetPaint(paint);
    text->SetTextStyle(false, request.italic);

    GxString string;
    if (!string.Construct(WithoutCarriageReturns(request.text).c_str())) {
        throw UsageError("the text is not valid UTF-8");
    }
    if (string.GetLength() > int(Limits::kMaxTextLength)) {
        throw UsageError("the text is longer than 100000 characters");
    }
    if (!text->SetText(&string)) throw RenderError("the text cannot be set");
    std::u16string utf16;
    {
        const int size = text->GetText()->GetUTF16Size();
        std::unique_ptr<uint16_t[]> units(text->GetText()->GetUTF16());
        if (units == nullptr || size < 1) throw RenderError("out of memory for the text");
        utf16.assign(reinterpret_cast<const char16_t*>(units.get()), size_t(size - 1));
    }

    // The layout a TextView of this size would make.
    const Measurer measure(text.get(), utf16);
    const int contentWidth = std::max(0, request.width - request.padding[0] - request.padding[2]);
    float wrap = request.wrap;
    if (wrap < 0.0f) wrap = request.width > 0 ? float(contentWidth) : 0.0f;
    if (request.width > 0 && wrap > 0.0f) wrap = std::min(wrap, float(std::max(contentWidth, 1)));
    std::vector<LayoutLine> layout = BreakLines(
        utf16, [&](size_t s, size_t e) { return measure(s, e); }, wrap);
    float widest = 0.0f;
    for (const LayoutLine& line : layout) widest = std::max(widest, line.width);
    const int layoutWidth = request.width > 0 ? contentWidth : ClampSide(std::ceil(double(widest)));
    PlaceLines(&layout, extent, request.fontPadding, layoutWidth, request.align);

    ViewGeometry view;
    view.paddingLeft = request.padding[0];
    view.paddingTop = request.padding[1];
    view.paddingRight = request.padding[2];
    view.paddingBottom = request.padding[3];
    view.width = request.width > 0 ? request.width : layoutWidth + view.paddingLeft + view.paddingRight;
    if (request.height > 0) {
        view.height = request.height;
    } else {
        // wrap_content: as tall as the lines the TextView itself would show.
        const size_t shown = request.maxLines >= 1 ? std::min(layout.size(), size_t(request.maxLines)) : layout.size();
        view.height = (shown > 0 ? layout[shown - 1].bottom : 0) + view.paddingTop + view.paddingBottom;
    }
    const int horizontal = request.align == Align::kCenter ? 0x01 : request.align == Align::kRight ? 0x05 : 0x03;
    view.gravity = horizontal | request.verticalGravity;
    view.maxLines = request.maxLines;
    view.lineLimit = request.lineLimit;
    if (view.width > Limits::kMaxSide || view.height > Limits::kMaxSide) {
        throw RenderError("the view would be " + std::to_string(view.width) + "x" + std::to_string(view.height) +
                          " pixels; at most 32767 a side");
    }

    // The view native.
    GxView* gxView = text->GetView();
    if (gxView == nullptr) throw RenderError("the text object has no view");
    gxView->gravity = view.gravity;
    gxView->maxLines = view.maxLines;
    text->SetTextColor(0xFF000000u);
    gxView->SetPadding(view.paddingLeft, view.paddingTop, view.paddingRight, view.paddingBottom);
    gxView->SetSize(view.width, view.height);
    // The line native.
    gxView->lineLimit = view.lineLimit;

    // The layout native: background span and line records.
    text->SetBackgroundColor(request.hasBackground ? request.background : 0, request.hasBackground);
    RenderResult result;
    result.layout = layout;
    result.lines = MakeLineRecords(layout, view);
    {
        List records;
        records.Construct();
        for (const GxLineInfo& line : result.lines) records.Add(new GxLineInfo(line));
        if (!text->SetLineInfo(&records)) {
            for (int i = 0; i < records.GetCount(); ++i) delete static_cast<GxLineInfo*>(records.Get(i));
            throw RenderError("the line records cannot be set");
        }
        records.RemoveAll();   // the text object owns them now
    }

    for (const EffectRequest& effect : request.effects) ApplyEffect(effect, text.get());

    // The render native.
    GxEffect* effects = text->GetEffect();
    result.viewWidth = view.width;
    result.viewHeight = view.height;
    result.left = effects->getLeftOffset();
    result.top = effects->getTopOffset();
    result.right = effects->getRightOffset();
    result.bottom = effects->getBottomOffset();
    const int64_t width = int64_t(view.width) + result.left + result.right;
    const int64_t height = int64_t(view.height) + result.top + result.bottom;
    if (width > Limits::kMaxSide || height > Limits::kMaxSide || width * height > Limits::kMaxPixels) {
        throw RenderError("the image would be " + std::to_string(width) + "x" + std::to_string(height) +
                          " pixels, more than can be allocated (at most 32767 a side and " +
                          std::to_string(Limits::kMaxPixels) + " pixels)");
    }
    if (width < 1 || height < 1) {
        throw RenderError("nothing to draw: the image would be " + std::to_string(width) + "x" +
                          std::to_string(height) + " pixels");
    }
    gxView->SetBitmapWidth(int(width));
    gxView->SetBitmapHeight(int(height));
    const unsigned* pixels = text->RenderTextEffect(int(width), int(height));
    if (pixels == nullptr) {
        throw RenderError("cannot allocate an image of " + std::to_string(width) + "x" + std::to_string(height) +
                          " pixels");
    }
    result.image = Image(int(width), int(height));
    std::memcpy(result.image.pixels.data(), pixels, result.image.pixels.size() * sizeof(uint32_t));

    // The key of what was drawn, the text layer carrying the text colour.
    std::unique_ptr<char[]> key(effects->getMapKey(text->GetTextColor()));
    result.key = PrintableKey(key.get());
    return result;
}

void DrawOver(Image* canvas, const Image& image, int x, int y) {
    for (int row = 0; row < image.height; ++row) {
        const int cy = y + row;
        if (cy < 0 || cy >= canvas->height) continue;
        for (int column = 0; column < image.width; ++column) {
            const int cx = x + column;
            if (cx < 0 || cx >= canvas->width) continue;
            const uint32_t s = image.At(column, row);
            const uint32_t sa = s >> 24;
            if (sa == 0) continue;
            uint32_t& d = canvas->At(cx, cy);
            const uint32_t da = d >> 24;
            // Straight alpha: out = s·sa + d·da·(1 − sa), divided by the new alpha.
            const uint32_t oa255 = sa * 255 + da * (255 - sa);   // alpha × 255
            if (oa255 == 0) {
                d = 0;
                continue;
            }
            uint32_t out = ((oa255 + 127) / 255) << 24;
            for (int shift = 0; shift <= 16; shift += 8) {
                const uint32_t sc = s >> shift & 0xFF, dc = d >> shift & 0xFF;
                const uint32_t c = (sc * sa * 255 + dc * da * (255 - sa) + oa255 / 2) / oa255;
                out |= std::min<uint32_t>(c, 255) << shift;
            }
            d = out;
        }
    }
}

}  // namespace Glimmer::RenderTool
