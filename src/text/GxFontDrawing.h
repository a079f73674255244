#pragma once
// GxFontDrawing: turns the lines of a text object into 8-bit coverage masks,
// one per line, feeds each to the effect stack at its place on the output
// bitmap, and after the last line runs the stack's post-processing and
// compositing into the caller's 32-bit bitmap. Failures are logged under
// "GxFontDrawing"; the caller composites whatever the destination holds.

#include <cstddef>

#include "platform/TextLayout.h"

namespace Glimmer {

class GxBitmap;
class GxEffect;
class GxString;
class GxTextObject;
class List;
struct GxGlyph;

class GxFontDrawing {
public:
    GxFontDrawing();
    virtual ~GxFontDrawing();
    GxFontDrawing(const GxFontDrawing&) = delete;
    GxFontDrawing& operator=(const GxFontDrawing&) = delete;

    // The key the font manager knows the text's font by; null is ignored.
    void SetFontPath(const char* path);
    const GxString* GetFontPath() const { return fontPath; }

    // Deletes every glyph of the list (the last line's, after a pass).
    void ClearGlyphList();
    const List* GetGlyphList() const { return glyphList; }

    void DrawTextEffect(GxTextObject* text, GxBitmap* dst);

    // Hands a line's glyphs to the effect stack: x and y are the pen
    // position and baseline in 26.6 fixed point; a negative direction walks
    // the glyphs from the last.
    void _DoRender(int x, int y, List* glyphs, GxEffect* effect, int direction);

private:
    GxString* fontPath = nullptr;
    List* glyphList = nullptr;
};

// Draws the glyphs of one font run of a laid-out line into the line's mask,
// placed so that the line bounds' top-left corner falls on the mask's (0, 0).
class DrawTextFunctor {
public:
    DrawTextFunctor(const Platform::Layout* layout, GxGlyph* mask, const float* bounds)
        : layout_(layout), mask_(mask), bounds_(bounds) {}

    void operator()(size_t start, size_t end, const Platform::RunFont& font);

private:
    const Platform::Layout* layout_;
    GxGlyph* mask_;
    const float* bounds_;   // left, top, right, bottom
};

}  // namespace Glimmer
