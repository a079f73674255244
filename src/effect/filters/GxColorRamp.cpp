#include "effect/filters/GxColorRamp.h"

#include <cmath>

#include "effect/GxEffectMath.h"

namespace Glimmer {

void BuildColorRamp(uint32_t* table, const GxGradient* stops, int32_t count, float firstPosition,
                    int curve) {
    table[0] = stops[0].color;
    table[kColorTableSize - 1] = stops[count - 1].color;

    int32_t segment = 0;  // the segment runs from stop `segment` to stop `segment + 1`
    float p0 = firstPosition;
    float p1 = stops[1].position;
    uint32_t c0 = stops[0].color;
    uint32_t c1 = stops[1].color;
    float span = p1 - p0;
    for (int i = 1; i < kColorTableSize - 1; ++i) {
        float t = float(i) * 0.00390625f;
        float u = curve == kRampSquare ? t * t : (curve == kRampSqrt ? std::sqrt(t) : t);
        // One stop per entry at most (see the header). Past the last stop the
        // segment stays where it is and the entries take the last colour.
        if (u > p1 && segment + 2 < count) {
            ++segment;
            p0 = p1;
            c0 = c1;
            p1 = stops[segment + 1].position;
            c1 = stops[segment + 1].color;
            span = p1 - p0;
        }
        // A zero span gives an infinity or NaN here; the saturating
        // conversion turns those into one end of the segment.
        int32_t f = EffectMath::TruncToInt((u - p0) / span * 256.0f);
        if (f < 1)
            table[i] = c0;
        else if (f >= 256)
            table[i] = c1;
        else
            table[i] = MixColor(c0, c1, uint32_t(f));
    }
}

bool BuildGradientTable(uint32_t* table, const GxGradient* stops, int32_t count) {
    if (stops == nullptr || count <= 0) return false;
    if (count == 1) {
        for (int i = 0; i < kColorTableSize; ++i) table[i] = stops[0].color;
        return true;
    }
    BuildColorRamp(table, stops, count, stops[0].position, kRampLinear);
    return true;
}

}  // namespace Glimmer
