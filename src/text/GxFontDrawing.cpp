// Glyph drawing: one mask per line.
//
// The pass takes the text's own font and the system's built families from
// the font manager (weight 400 unless the font's name says otherwise, italic
// from the text's style; once the system's families are set, the system's
// last-resort fonts too), adds the plain-text layer in the text colour and
// starts the effect stack on the destination's size. Then, line by line:
//  - the line is shaped from its start to its visible end, with the text
//    from the last line break before it (CR or LF at an index of 1 or more)
//    as context, right to left by default when the record's direction is
//    negative and left to right otherwise;
//  - its mask is the line's advance wide and its ink bounds high, both
//    truncated, with the baseline `top` rows down; the glyphs are drawn so
//    that the bounds' top-left corner falls on the mask's (0, 0). Ink that
//    reaches past that box (a slant or fake bold carries the last glyph past
//    the advance; a fractional offset carries a mark below the last row)
//    widens or deepens the mask just enough to keep it, so a line whose ink
//    fits keeps exactly the box it always had;
//  - the mask goes to the effect stack with its left edge at the record's x
//    and its baseline at the record's baseline, both moved by the effects'
//    left and top margins;
//  - the record's box becomes the line's drawn extent for the background:
//    left and right from the placed mask, top and bottom moved down by the
//    top margin. The box is moved in place, so every further render of the
//    same records moves it again: deliberate, and kept.
// Post-processing and compositing run after the last line, also when there
// were no lines.
//
// A record whose range does not lie inside the text (the text object refuses
// to render such records; a direct caller may still pass one) lays out as
// nothing: a zero-sized mask, still handed to the stack. Masks are capped at 65535
// pixels a side and at the largest block a bitmap may have.

#include "text/GxFontDrawing.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstring>
#include <new>
#include <vector>

#include "effect/GxEffect.h"
#include "effect/GxGlyph.h"
#include "font/FontManager.h"
#include "foundation/Error.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/Log.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"

namespace Glimmer {
namespace {

constexpr const char* kTag = "GxFontDrawing";
constexpr int kMaxMaskSide = 65535;

int ClampToInt(int64_t value) { return int(std::clamp<int64_t>(value, INT_MIN, INT_MAX)); }

// A float truncated toward zero into a mask dimension.
int MaskSide(float value) {
    if (!(value > 0.0f)) return 0;
    if (value >= float(kMaxMaskSide)) return kMaxMaskSide;
    return int(value);
}

int Truncate(float value) {
    if (!(value > float(INT_MIN) && value < float(INT_MAX))) return 0;
    return int(value);
}

// A zero-filled width x height mask; 0 x 0 when no such block can be had.
GxGlyph* NewLineMask(int width, int height, int top) {
    auto* glyph = new (std::nothrow) GxGlyph();
    if (glyph == nullptr) return nullptr;
    size_t bytes = 0;
    if (GxBitmap::PixelBytes(unsigned(width), unsigned(height), 1, &bytes)) {
        if (bytes > 0) glyph->buffer = new (std::nothrow) unsigned char[bytes]();
        if (bytes == 0 || glyph->buffer != nullptr) {
            glyph->width = uint16_t(width);
            glyph->height = uint16_t(height);
        }
    }
    glyph->top = top;
    glyph->left = 0;
    return glyph;
}

// Pixels the ink of a box `extent` pixels across may reach when drawn from a
// fractional origin: whole-pixel origins round each glyph by up to half a
// pixel, sub-pixel ones spill into the next pixel. One more for rounding.
int InkReach(float extent) {
    if (!(extent > 0.0f)) return 0;
    if (extent >= float(kMaxMaskSide)) return kMaxMaskSide;
    return std::min(kMaxMaskSide, int(std::ceil(extent)) + 1);
}

// Narrows a mask drawn with room to spare to its line box (boxWidth x
// boxHeight) plus the columns and rows that hold ink, repacking the rows.
void TrimToInk(GxGlyph* glyph, int boxWidth, int boxHeight) {
    const int width = glyph->width, height = glyph->height;
    if (glyph->buffer == nullptr || (width <= boxWidth && height <= boxHeight)) return;
    int inkWidth = std::min(boxWidth, width), inkHeight = std::min(boxHeight, height);
    for (int y = 0; y < height; ++y) {
        const unsigned char* row = glyph->buffer + size_t(y) * size_t(width);
        int last = width - 1;
        while (last >= inkWidth && row[last] == 0) --last;
        inkWidth = std::max(inkWidth, last + 1);
        if (y >= inkHeight && std::any_of(row, row + width, [](unsigned char c) { return c != 0; })) {
            inkHeight = y + 1;
        }
    }
    if (inkWidth < width) {
        for (int y = 1; y < inkHeight; ++y) {
            std::memmove(glyph->buffer + size_t(y) * size_t(inkWidth), glyph->buffer + size_t(y) * size_t(width),
                         size_t(inkWidth));
        }
    }
    glyph->width = uint16_t(inkWidth);
    glyph->height = uint16_t(inkHeight);
}

}  // namespace

GxFontDrawing::GxFontDrawing() {
    glyphList = new (std::nothrow) List();
    if (glyphList != nullptr && !glyphList->Construct()) {
        delete glyphList;
        glyphList = nullptr;
    }
}

GxFontDrawing::~GxFontDrawing() {
    delete fontPath;
    ClearGlyphList();
    delete glyphList;
}

void GxFontDrawing::SetFontPath(const char* path) {
    if (path == nullptr) return;
    if (fontPath == nullptr) {
        fontPath = new (std::nothrow) GxString();
        if (fontPath != nullptr && !fontPath->Construct(path)) {
            delete fontPath;
            fontPath = nullptr;
        }
        return;
    }
    if (fontPath->CompareTo(path) != 0) fontPath->Set(path);
}

void GxFontDrawing::ClearGlyphList() {
    if (glyphList == nullptr) return;
    int count = glyphList->GetCount();
    if (count <= 0) return;
    for (int i = 0; i < count; ++i) {
        auto* glyph = static_cast<GxGlyph*>(glyphList->Get(i));
        if (glyph == nullptr) continue;
        delete[] glyph->buffer;
        delete glyph;
    }
    glyphList->RemoveAll();
}

void DrawTextFunctor::operator()(size_t start, size_t end, const Platform::RunFont& font) {
    if (mask_ == nullptr || mask_->buffer == nullptr || end <= start) return;
    std::vector<uint16_t> ids;
    std::vector<float> positions;
    ids.reserve(end - start);
    positions.reserve(2 * (end - start));
    for (size_t i = start; i < end; ++i) {
        const Platform::LayoutGlyph& glyph = layout_->glyphs[i];
        ids.push_back(uint16_t(glyph.glyphId));
        positions.push_back(glyph.x);
        positions.push_back(glyph.y);
    }
    Platform::DrawGlyphs(font, ids.data(), positions.data(), ids.size(), -bounds_[0], -bounds_[1],
                         mask_->buffer, mask_->width, mask_->height);
}

void GxFontDrawing::DrawTextEffect(GxTextObject* text, GxBitmap* dst) {
    if (text == nullptr) return;
    GxString* string = text->GetText();
    if (string == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "DrawTextEffect(%p) - text is NULL",
                           static_cast<void*>(text));
        return;
    }
    int textLength = string->GetUTF16Size() - 1;
    if (textLength < 1) {
        Platform::LogPrint(Platform::kLogError, kTag, "DrawTextEffect(%p) - textLength is 0",
                           static_cast<void*>(text));
        return;
    }
    GxEffect* effect = text->GetEffect();
    if (effect == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "DrawTextEffect(%p) - Effect is NULL",
                           static_cast<void*>(text));
        return;
    }
    if (dst == nullptr) return;

    Platform::Paint paint = text->GetPaint();
    if (effect->getLayerStyle()) {
        effect->addText(text->GetTextColor(), effect->getTextOpacity());  // the fill opacity
    } else {
        effect->addText(text->GetTextColor());
    }
    effect->initEffect(int(dst->width), int(dst->height));
    effect->setDstBitmap(dst);

    List* lines = text->GetLineInfo();
    if (lines == nullptr) {
        Platform::LogPrint(Platform::kLogError, kTag, "DrawTextEffect(%p) - lineInfoList is NULL",
                           static_cast<void*>(text));
        GX_REPORT_ERROR(kTag, kErrorNotConstructed);
        return;
    }

    int weight = 400;
    Platform::FontFamilies families;
    if (!FontManager::GetInstance()->GetMinikinFontFamilies(families, fontPath, &weight)) {
        Platform::LogPrint(Platform::kLogError, kTag, "DrawTextEffect(%p) - GetMinikinFontFamilies failed",
                           static_cast<void*>(text));
        return;
    }
    std::shared_ptr<Platform::Typeface> typeface =
        Platform::CreateTypefaceFromFamilies(families, weight, text->isItalicTextStyle());
    // The system's last-resort fonts come with the system's families.
    typeface->systemFallback = FontManager::GetInstance()->IsSystemFontFamiliesAlreadySet();

    const int leftOffset = effect->getLeftOffset();
    const int topOffset = effect->getTopOffset();
    uint16_t* utf16 = string->GetUTF16();

    int count = utf16 != nullptr ? lines->GetCount() : 0;
    for (int i = 0; i < count; ++i) {
        auto* record = static_cast<GxLineInfo*>(lines->Get(i));
        if (record == nullptr) continue;
        ClearGlyphList();

        Platform::Bidi bidi = record->direction < 0 ? Platform::Bidi::kDefaultRtl : Platform::Bidi::kDefaultLtr;
        bool inside = record->start >= 0 && record->end >= record->start && record->end <= textLength;
        int contextStart = 0;
        if (inside) {
            for (int at = record->start; at >= 1; --at) {
                if (at < textLength && (utf16[at] == 10 || utf16[at] == 13)) {
                    contextStart = at;
                    break;
                }
            }
        }
        Platform::Layout layout;
        if (inside) {
            Platform::LayoutText(paint, bidi, *typeface, utf16, size_t(textLength), size_t(record->start),
                                 size_t(record->end - record->start), size_t(contextStart),
                                 size_t(record->end - contextStart), &layout);
        }

        const Platform::LayoutRect& bounds = layout.bounds;
        const int boxWidth = MaskSide(layout.advance);
        const int boxHeight = MaskSide(bounds.bottom - bounds.top);
        GxGlyph* glyph = NewLineMask(std::max(boxWidth, InkReach(bounds.right - bounds.left)),
                                     std::max(boxHeight, InkReach(bounds.bottom - bounds.top)),
                                     Truncate(-bounds.top));
        if (glyph != nullptr && glyph->buffer == nullptr && int64_t(boxWidth) * boxHeight > 0) {
            delete glyph;   // no room to spare: the line box alone, as before
            glyph = NewLineMask(boxWidth, boxHeight, Truncate(-bounds.top));
        }
        if (glyph == nullptr) continue;
        const float box[4] = {bounds.left, bounds.top, bounds.right, bounds.bottom};
        DrawTextFunctor draw(&layout, glyph, box);
        Platform::ForEachFontRun(layout, paint,
                                 [&](size_t start, size_t end, const Platform::RunFont& font) {
                                     draw(start, end, font);
                                 });
        TrimToInk(glyph, boxWidth, boxHeight);

        if (glyphList == nullptr || !glyphList->Add(glyph)) {
            delete[] glyph->buffer;
            delete glyph;
            continue;
        }
        int penX = ClampToInt(int64_t(record->x) + leftOffset);
        int baseline = ClampToInt(int64_t(record->baseline) + topOffset);
        _DoRender(ClampToInt(int64_t(penX) * 64), ClampToInt(int64_t(baseline) * 64), glyphList, effect,
                  record->direction);

        record->bounds.left = penX;
        record->bounds.right = ClampToInt(int64_t(penX) + Truncate(layout.advance));
        record->bounds.top = ClampToInt(int64_t(record->bounds.top) + topOffset);
        record->bounds.bottom = ClampToInt(int64_t(record->bounds.bottom) + topOffset);
    }

    typeface.reset();
    effect->doEffectPostProcessing();
    effect->compositeLayers(dst);
    delete[] utf16;
}

void GxFontDrawing::_DoRender(int x, int y, List* glyphs, GxEffect* effect, int direction) {
    if (glyphs == nullptr || effect == nullptr) return;
    int count = glyphs->GetCount();
    if (count <= 0) return;
    const int row = y >> 6;
    int64_t penX = x;
    for (int n = 0; n < count; ++n) {
        int index = direction < 0 ? count - 1 - n : n;
        auto* glyph = static_cast<GxGlyph*>(glyphs->Get(index));
        if (glyph == nullptr) continue;
        int column = ClampToInt(int64_t(glyph->left) + (penX >> 6));
        effect->renderEffectLayer(column, ClampToInt(int64_t(row) - glyph->top), glyph);
        penX += int64_t(glyph->width) * 64;
    }
}

}  // namespace Glimmer
