#pragma once
// Line layout for the public API: breaking a text into lines, placing them
// (tops, baselines, alignment) the way a TextView's Layout would, and turning
// the lines shown into the line records the core's text object draws.

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "api/FontData.h"
#include "glimmer/glimmer.h"
#include "text/GxLineInfo.h"

namespace glimmer::detail {

// One laid-out line.
struct LayoutLine {
    int start = 0;        // first UTF-16 unit
    int end = 0;          // past trailing spaces and the line break
    int visibleEnd = 0;   // past the last unit that is not a trailing space
    float width = 0.0f;   // advance up to the visible end
    float left = 0.0f;    // x of the line in the layout width
    int top = 0;
    int bottom = 0;
    int baseline = 0;
    int ascent = 0;       // negative
    int descent = 0;
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

// The view the shown lines [first, first + count) are drawn in.
struct ViewGeometry {
    int width = 0;
    int height = 0;
    Padding padding;
    Gravity gravity = Gravity::kTop;
    int first = 0;
    int count = 0;
};

// One record per shown line: the block of shown lines placed by the vertical
// gravity (under the top padding, centred in the padded view when it is
// shorter, or with its last line on the bottom padding), each x at the left
// padding plus the line's left, the background box from the line's ascent,
// descent and width. Direction is always 1: each line's direction comes from
// its first strong character.
std::vector<Glimmer::GxLineInfo> MakeLineRecords(const std::vector<LayoutLine>& lines, const ViewGeometry& view);

}  // namespace glimmer::detail
