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

}  // namespace Glimmer
