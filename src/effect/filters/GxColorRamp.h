#pragma once
// 257-entry colour tables for the glow and gradient layers.
//
// A colour ramp turns a list of gradient stops into a table indexed 0..256:
// entry 0 is the first stop's colour, entry 256 the last stop's, and every
// entry i in between samples the ramp at t = i / 256. Entries are 0xAARRGGBB
// words in straight (not premultiplied) colour; the layers premultiply when
// they look an entry up.
//
// Two details are deliberate and shared by every table:
// - The walk along the stops advances at most one stop per entry. A ramp
//   whose stops lie closer together than 1/256 therefore lags behind: an
//   entry may still be inside a segment that t has already left. Looping
//   until the right segment is found would change the tables.
// - Two colours mix with an 8-bit weight f, (c1 * f + c0 * (256 - f)) >> 8 per
//   channel, computed two channels at a time (red and blue, then alpha and
//   green), alpha mixed like the colours.
//
// The glow and gradient tables differ in where the first segment starts (0
// for a glow, the first stop's position for a gradient) and in the glow's
// optional easing of t; both are parameters of BuildColorRamp.

#include <cstdint>

#include "effect/GxProperty.h"

namespace Glimmer {

inline constexpr int kColorTableSize = 257;

// How t is eased before the stops are looked up (glows only).
enum ColorRampCurve : int {
    kRampLinear = 0,
    kRampSqrt = 1,    // u = sqrt(t)
    kRampSquare = 2,  // u = t * t
};

// (c1 * f + c0 * (256 - f)) >> 8 on each byte, for f in 1..255.
inline uint32_t MixColor(uint32_t c0, uint32_t c1, uint32_t f) {
    uint32_t g = 256u - f;
    uint32_t rb = (((c1 & 0x00FF00FFu) * f + (c0 & 0x00FF00FFu) * g) >> 8) & 0x00FF00FFu;
    uint32_t ag = (((c1 >> 8) & 0x00FF00FFu) * f + ((c0 >> 8) & 0x00FF00FFu) * g) & 0xFF00FF00u;
    return rb | ag;
}

// Straight 0xAARRGGBB to premultiplied: each colour channel becomes
// ((ch + 1) * alpha) >> 8, alpha stays.
inline uint32_t PremultiplyColor(uint32_t c) {
    uint32_t a = c >> 24;
    uint32_t r = ((((c >> 16) & 0xFFu) + 1u) * a) >> 8;
    uint32_t g = ((((c >> 8) & 0xFFu) + 1u) * a) >> 8;
    uint32_t b = (((c & 0xFFu) + 1u) * a) >> 8;
    return (a << 24) | (r << 16) | (g << 8) | b;
}

// Fills table[0..256] from `count` stops (count >= 2, stops non-null). The
// first segment runs from `firstPosition` to stop 1's position.
void BuildColorRamp(uint32_t* table, const GxGradient* stops, int32_t count, float firstPosition,
                    int curve);

// The gradient fills' table: one stop fills every entry with its colour, two
// or more make a ramp that starts at stop 0's position. False, and the table
// untouched, when there are no stops (null stops count as none).
bool BuildGradientTable(uint32_t* table, const GxGradient* stops, int32_t count);

}  // namespace Glimmer
