#pragma once
// Laying out one line of text and drawing its glyphs into an 8-bit mask.
//
// LayoutText shapes a range of UTF-16 text with a paint and a typeface: it
// splits the range into directional runs, picks a font for every character
// from the typeface's families (the first family that has the character; a
// style close to the one asked for inside the family), shapes each piece with
// the text around it as context and places the glyphs on one baseline, left
// to right in visual order. The result holds glyph ids and positions in
// pixels (y down, the pen starting at 0 on the baseline), the line's advance
// and the ink bounds of all its glyphs.
//
// DrawGlyphs rasterises one run of glyphs that share a font into a mask,
// blending each glyph's coverage over what is already there.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "platform/Font.h"
#include "platform/Paint.h"

namespace Glimmer::Platform {

// Paragraph direction: the numbers the line records' direction maps onto.
enum class Bidi : int {
    kLtr = 0,
    kRtl = 1,
    kDefaultLtr = 2,   // from the first strong character; left to right without one
    kDefaultRtl = 3,   // the same, right to left without one
    kForceLtr = 4,     // the whole range as one left-to-right run
    kForceRtl = 5,
};

// Styles a font lacks and the rasteriser makes up.
struct Fakery {
    bool bold = false;
    bool italic = false;
};

struct LayoutRect {
    float left = 0.0f;
    float top = 0.0f;      // negative above the baseline
    float right = 0.0f;
    float bottom = 0.0f;
    bool IsEmpty() const { return !(left < right && top < bottom); }
};

struct LayoutGlyph {
    const Font* font = nullptr;   // kept alive by the layout's runs
    uint32_t glyphId = 0;
    float x = 0.0f;
    float y = 0.0f;
};

// Glyphs [start, end) of a layout share one font and fakery.
struct FontRun {
    size_t start = 0;
    size_t end = 0;
    std::shared_ptr<Font> font;
    Fakery fakery;
};

struct Layout {
    std::vector<LayoutGlyph> glyphs;
    std::vector<FontRun> runs;
    float advance = 0.0f;
    LayoutRect bounds;   // all zero when no glyph has ink
};

// Lays out text[start, start + count) shaped with the context
// text[contextStart, contextStart + contextCount). False, with an empty
// layout, when the ranges do not nest inside the text; a paint size that is
// not a positive finite number, or a typeface without families, gives an
// empty layout and true. Without `inkBounds` the bounds stay empty: measuring
// an advance needs no glyph outline, and outlines are most of a layout's cost.
bool LayoutText(const Paint& paint, Bidi bidi, const Typeface& typeface, const uint16_t* text,
                size_t textLength, size_t start, size_t count, size_t contextStart,
                size_t contextCount, Layout* out, bool inkBounds = true);

// How one font run is drawn: the paint's size, stretch and slant, with the
// run's fakery added to the paint's own (fake italic leans by a quarter).
struct RunFont {
    const Font* font = nullptr;
    float size = 12.0f;
    float scaleX = 1.0f;
    float skewX = 0.0f;
    bool embolden = false;
    bool antiAlias = true;
    bool subpixel = false;
};

RunFont ResolveRunFont(const Paint& paint, const FontRun& run);

// Calls fn(start, end, runFont) for every font run of the layout, in order.
template <typename Fn>
void ForEachFontRun(const Layout& layout, const Paint& paint, Fn&& fn) {
    for (const FontRun& run : layout.runs) fn(run.start, run.end, ResolveRunFont(paint, run));
}

// Draws `count` glyphs of one font into the width x height mask (rows of
// `width` bytes), glyph i with its origin at (originX + positions[2i],
// originY + positions[2i + 1]). Coverage is blended over the mask (source
// over); nothing outside the mask is touched.
void DrawGlyphs(const RunFont& font, const uint16_t* glyphIds, const float* positions, size_t count,
                float originX, float originY, uint8_t* mask, int width, int height);

// Ink bounds of one glyph drawn with `font` at the origin, in whole pixels
// (y down); empty for a glyph without ink.
LayoutRect GlyphBounds(const RunFont& font, uint32_t glyphId);

}  // namespace Glimmer::Platform
