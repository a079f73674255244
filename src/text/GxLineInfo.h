#pragma once
// One laid-out line of a text: where it sits in the view, which part of the
// text it shows, its direction, and the box painted behind it when the text
// has a background colour.

#include <cstdint>

#include "foundation/GxRect.h"

namespace Glimmer {

struct GxLineInfo {
    int32_t x = 0;          // left pen position, view pixels
    int32_t baseline = 0;   // y of the baseline, view pixels
    int32_t start = 0;      // first UTF-16 unit of the line
    int32_t end = 0;        // one past its last visible unit
    int32_t direction = 1;  // negative: right to left
    GxRect bounds;          // the background box; moved by every render
};

}  // namespace Glimmer
