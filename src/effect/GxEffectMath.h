#pragma once
// Small conversions shared by the property records and the effect stack.
// Everything is single precision; float-to-int conversions saturate (NaN
// gives 0) so that no argument a caller can pass makes a conversion undefined.

#include <cstdint>

namespace Glimmer::EffectMath {

// Truncation toward zero, saturated to the int32 range.
inline int32_t TruncToInt(float v) {
    if (!(v == v)) return 0;
    if (v >= 2147483648.0f) return INT32_MAX;
    if (v < -2147483648.0f) return INT32_MIN;
    return static_cast<int32_t>(v);
}

// trunc(v) remainder `modulus`, truncating division: the sign of v is kept.
inline float FoldDegrees(float v, int32_t modulus) {
    return static_cast<float>(TruncToInt(v) % modulus);
}

// NaN takes the lower bound.
inline float ClampFloat(float v, float lo, float hi) {
    if (!(v >= lo)) return lo;
    return v > hi ? hi : v;
}

inline int32_t ClampInt(int32_t v, int32_t lo, int32_t hi) { return v < lo ? lo : (v > hi ? hi : v); }

}  // namespace Glimmer::EffectMath
