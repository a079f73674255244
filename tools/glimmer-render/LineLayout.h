#pragma once
// The line layout a Java caller would have: what a TextView's Layout reports
// for the text (line starts and visible ends, line lefts and widths, tops,
// baselines, ascents and descents), and the line records the layout native
// makes of it for a view (which lines are shown, where the baselines fall
// under the view's vertical gravity).

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "text/GxLineInfo.h"

namespace Glimmer::RenderTool {

// Vertical metrics of a font at a text size in whole pixels, y down: the font
// box top and bottom, and the ascent and descent lines.
struct FontExtent {
    int top = 0;       // negative
    int ascent = 0;    // negative
    int descent = 0;
    int bottom = 0;
};

// The extent of face 0 of the font in `data` at `textSize` pixels per em;
// RenderError when the bytes are no font.
FontExtent MeasureFontExtent(const char* data, size_t size, float textSize);

enum class Align { kLeft, kCenter, kRight };

// One line as the Java Layout reports it.
struct LayoutLine {
    int start = 0;        // getLineStart
    int end = 0;          // getLineEnd: past trailing spaces and the line break
    int visibleEnd = 0;   // getLineVisibleEnd
    float width = 0.0f;   // getLineWidth: advance up to the visible end
    float left = 0.0f;    // getLineLeft
    int top = 0;          // getLineTop
    int bottom = 0;       // getLineBottom
    int baseline = 0;     // getLineBaseline
    int ascent = 0;       // getLineAscent (negative)
    int descent = 0;      // getLineDescent
};

// The advance of text[start, end) as the glyph drawing will shape it.
using MeasureFn = std::function<float(size_t start, size_t end)>;

// Splits UTF-16 text into lines: at every '\n', and, when wrapWidth > 0,
// greedily at Unicode line-break opportunities so that each line's visible
// part fits (a word wider than the width is cut between grapheme clusters).
// Fills start, end, visibleEnd and width; one line per paragraph at least,
// an empty one after a final '\n'.
std::vector<LayoutLine> BreakLines(const std::u16string& text, const MeasureFn& measure, float wrapWidth);

// Fills the vertical metrics (each line's ascent and descent from the font;
// with includePad the first line's top and the last line's bottom reach to
// the font box, as TextView's default font padding does) and the left of
// each line within `layoutWidth` for the alignment.
void PlaceLines(std::vector<LayoutLine>* lines, const FontExtent& extent, bool includePad, int layoutWidth,
                Align align);

// The view as the layout native reads it.
struct ViewGeometry {
    int width = 0;
    int height = 0;
    int paddingLeft = 0;
    int paddingTop = 0;
    int paddingRight = 0;
    int paddingBottom = 0;
    int gravity = 0x33;
    int lineLimit = 0;    // lines to show when >= 1
    int maxLines = 0;     // else this many when >= 1, else none
};

// The line records for the view: which lines are shown (the last ones under
// bottom gravity), each baseline placed by the vertical gravity, each x at
// the left padding plus the line's left, the background box from the line's
// ascent, descent and width. Direction is always 1.
std::vector<GxLineInfo> MakeLineRecords(const std::vector<LayoutLine>& lines, const ViewGeometry& view);

}  // namespace Glimmer::RenderTool
