#pragma once
// Square roots for the relief filters (bevel, emboss).
//
// fsqrt is the classic bit-trick reciprocal square root with one Newton step,
// multiplied back by x: about 0.2% off, and the filters' output depends on
// exactly that error, so it is kept bit for bit (order of the products
// included) rather than replaced by sqrtf.
//
// GX_INT_SQRT_TABLE holds sqrt(i) for i = 0..5489 rounded to the nearest 0.001
// and then to the nearest float. The filters index it by dx*dx + dy*dy, which
// for the larger relief sizes runs past the end; IntSqrt() answers those
// indices with the value the table would hold if it were longer.

#include <array>
#include <bit>
#include <cstdint>

namespace Glimmer {

inline constexpr int kIntSqrtTableSize = 5490;

extern const std::array<float, kIntSqrtTableSize> GX_INT_SQRT_TABLE;

inline float fsqrt(float x) {
    int32_t i = std::bit_cast<int32_t>(x);
    float y = std::bit_cast<float>(int32_t(0x5F3759DF - (i >> 1)));
    float t = (x * -0.5f) * y;
    t = t * y;
    t = t + 1.5f;
    return (y * x) * t;
}

// sqrt(i) rounded to the nearest 0.001, as the nearest float.
constexpr float RoundedSqrt(uint32_t i) {
    // k = nearest integer to 1000 * sqrt(i), found exactly in integers:
    // (2k - 1)^2 <= 4e6 * i < (2k + 1)^2.
    uint64_t target = uint64_t(4000000) * i;
    uint64_t lo = 0, hi = 1000ull * 65536ull;
    while (lo < hi) {  // largest k with (2k - 1)^2 <= target
        uint64_t mid = (lo + hi + 1) / 2;
        uint64_t odd = 2 * mid - 1;
        if (odd * odd <= target) lo = mid; else hi = mid - 1;
    }
    // lo / 1000 is never a float midpoint, so rounding through double is exact.
    return float(double(lo) / 1000.0);
}

inline float IntSqrt(int index) {
    if (index >= 0 && index < kIntSqrtTableSize) return GX_INT_SQRT_TABLE[index];
    return index < 0 ? 0.0f : RoundedSqrt(uint32_t(index));
}

}  // namespace Glimmer
