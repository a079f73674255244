#pragma once

#include <cstdint>

namespace Glimmer {

// One line of text as an 8-bit coverage mask, with where it sits relative to
// the pen: the unit the glyph drawing hands to the effect stack.
struct GxGlyph {
    // Row-major coverage, rows of `width` bytes. Owned by whoever made the
    // glyph (the glyph drawing allocates it with array-new).
    unsigned char* buffer = nullptr;
    uint16_t width = 0;
    uint16_t height = 0;
    // Rows from the mask's top row down to the baseline.
    int32_t top = 0;
    // Horizontal offset of the mask from the pen position.
    int32_t left = 0;
};

}  // namespace Glimmer
