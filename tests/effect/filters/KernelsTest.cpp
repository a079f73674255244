// The root table against its decimal definition, and the Gaussian weights.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include "effect/filters/GxGaussian.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

// The table's definition: the decimal sqrt(i) to three places, read as a float
// by the C library (correctly rounded).
float DecimalSqrt(int i) {
    long k = std::lround(std::sqrt(double(i)) * 1000.0);
    char text[32];
    std::snprintf(text, sizeof text, "%ld.%03ld", k / 1000, k % 1000);
    return std::strtof(text, nullptr);
}

TEST(SqrtTable, MatchesThreeDecimalRoundingInsideAndBeyondTheTable) {
    for (int i = 0; i < kIntSqrtTableSize; ++i) ASSERT_EQ(GX_INT_SQRT_TABLE[i], DecimalSqrt(i)) << "table entry " << i;
    // Past the end: the value a longer table would hold (relief sizes up to 100+).
    for (int i = kIntSqrtTableSize; i < 2 * 110 * 110; i += 7) ASSERT_EQ(IntSqrt(i), DecimalSqrt(i)) << i;
    EXPECT_EQ(IntSqrt(-1), 0.0f);
    // The one-Newton-step root: these bit patterns, not the true root's.
    EXPECT_EQ(fsqrt(4.0f), 1.99661434f);
    EXPECT_EQ(fsqrt(1.0f), 0.998307168f);
}

TEST(GaussianWeights, CentreAndRoundingVariants) {
    int w[101];
    int sum = 0;
    ComputeGaussianWeights(w, &sum, 3, kShadowGaussianCentre, GaussianRounding::kDouble);
    EXPECT_EQ((std::vector<int>{w[0], w[1], w[2], w[3], sum}), (std::vector<int>{100, 60, 13, 1, 248}));
    ComputeGaussianWeights(w, &sum, 0, kGlowGaussianCentre, GaussianRounding::kSingle);
    EXPECT_TRUE(w[0] == 128 && sum == 128);
    // The tail weight is 1% of the centre whatever the radius.
    ComputeGaussianWeights(w, &sum, 100, kGlowGaussianCentre, GaussianRounding::kDouble);
    EXPECT_EQ(w[100], 1);
}

}  // namespace
}  // namespace Glimmer
