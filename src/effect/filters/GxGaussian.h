#pragma once
// Integer Gaussian weights shared by the shadow, glow and relief filters.
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
// The two can give different weights for the same radius.

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

}  // namespace Glimmer
