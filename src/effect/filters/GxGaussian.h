#pragma once
// The integer Gaussian shared by the shadow, glow and relief filters.
//
// Every blur in the engine is separable and integer: a row of R + 1 weights
// w[0..R] with w[0] = centre and
//     w[i] = round(exp(-i^2 / (R^2 / 4.60517)) * centre)
// (4.60517 = ln 100, so the tail weight at i = R is 1% of the centre), and one
// division by the total S = w[0] + 2 * (w[1] + ... + w[R]) per output sample.
//
// The filters differ in two deliberate details, kept as parameters: the centre
// weight (100 for shadows and reliefs, 128 for glows) and where the +0.5 of the
// rounding is added (in float, or after widening the float product to double).
// The two can give different weights for the same radius. A pass may also be
// taken "inverted": (255 * S - sum) / S, the blur of 255 minus the samples.
//
// The division. A sample's sum never exceeds 255 * S (every tap is a byte and
// the weights add up to S), and dividing by S costs 20 to 40 cycles, more than
// all the taps of a small radius. GxDivisor replaces it by a multiply and a
// shift that give the same quotient for every dividend up to a bound:
//     x / S == (x * m) >> s   for 0 <= x <= X,
// with m = ceil(2^s / S) and s the least with X * (S - 1) < 2^s. Why: let
// e = m * S - 2^s, so 0 <= e <= S - 1. Then x * m / 2^s = x / S + x * e /
// (S * 2^s), and the second term is below 1 / S because x * e <= X * (S - 1)
// < 2^s. The fractional part of x / S is at most (S - 1) / S, so adding less
// than 1 / S never reaches the next integer: the floors agree. For the blur's
// X = 255 * S and S below 2^17, m stays below 2^26 and x * m below 2^51.
// (Quotients are non-decreasing in x on both sides, so a check of the largest
// dividend of every quotient, x = q * S + S - 1, covers the whole range; the
// tests run every dividend for the divisors the stack can produce.)

#include <cstdint>

#include "effect/filters/GxFilterLimits.h"

namespace Glimmer {

enum class GaussianRounding {
    kSingle,  // trunc(g * centre + 0.5f)
    kDouble,  // trunc(double(g * centre) + 0.5)
};

inline constexpr int kShadowGaussianCentre = 100;
inline constexpr int kGlowGaussianCentre = 128;

// Fills weights[0..radius] and *sum. A radius of 0 or less gives the single
// centre weight and S = centre (no blur).
void ComputeGaussianWeights(int* weights, int* sum, int radius, int centre, GaussianRounding rounding);

// Exact x / divisor for 0 <= x <= largest, as (x * multiplier) >> shift.
struct GxDivisor {
    uint32_t divisor = 1;
    uint64_t multiplier = 1;
    uint32_t shift = 0;

    // divisor >= 1 and largest * (divisor - 1) < 2^62.
    static GxDivisor For(uint32_t divisor, uint64_t largest);
    uint32_t operator()(uint64_t x) const { return uint32_t((x * multiplier) >> shift); }
};

// One blur radius planned: weights, total, and the division by the total for
// every sum a pass can reach (255 * total).
struct GxGaussian {
    int radius = 0;
    uint32_t sum = 1;
    uint32_t full = 255;  // 255 * sum, the start of an inverted pass
    GxDivisor divide;
    int weights[kMaxFilterRadius + 1] = {};
};

// False (nothing planned) for a radius beyond kMaxFilterRadius or a centre
// outside 1..128. A radius below 0 plans as 0.
bool PlanGaussian(GxGaussian* plan, int radius, int centre, GaussianRounding rounding);

}  // namespace Glimmer
