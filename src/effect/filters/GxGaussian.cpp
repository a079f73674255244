#include "effect/filters/GxGaussian.h"

#include <cmath>

namespace Glimmer {

void ComputeGaussianWeights(int* weights, int* sum, int radius, int centre, GaussianRounding rounding) {
    weights[0] = centre;
    int total = centre;
    const float spread = float(radius * radius) / 4.60517f;
    for (int i = 1; i <= radius; ++i) {
        float g = std::exp(float(-(i * i)) / spread);
        float scaled = g * float(centre);
        int w = rounding == GaussianRounding::kDouble ? int(double(scaled) + 0.5) : int(scaled + 0.5f);
        weights[i] = w;
        total += 2 * w;
    }
    *sum = total;
}

GxDivisor GxDivisor::For(uint32_t divisor, uint64_t largest) {
    GxDivisor d;
    d.divisor = divisor < 1 ? 1 : divisor;
    // The least s with largest * (divisor - 1) < 2^s (see the header).
    const uint64_t error = largest * (d.divisor - 1);
    uint32_t s = 0;
    while (s < 63 && (uint64_t(1) << s) <= error) ++s;
    d.shift = s;
    d.multiplier = ((uint64_t(1) << s) + d.divisor - 1) / d.divisor;
    return d;
}

bool PlanGaussian(GxGaussian* plan, int radius, int centre, GaussianRounding rounding) {
    // The vector kernels multiply 16-bit tap pairs (up to 510) by a weight.
    if (radius > kMaxFilterRadius || centre < 1 || centre > 128) return false;
    if (radius < 0) radius = 0;
    int sum = 0;
    ComputeGaussianWeights(plan->weights, &sum, radius, centre, rounding);
    plan->radius = radius;
    plan->sum = uint32_t(sum);
    plan->full = 255u * plan->sum;
    plan->divide = GxDivisor::For(plan->sum, plan->full);
    return true;
}

}  // namespace Glimmer
