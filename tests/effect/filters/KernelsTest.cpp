#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>

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
    EXPECT_EQ(GX_INT_SQRT_TABLE[0], 0.0f);
    EXPECT_EQ(GX_INT_SQRT_TABLE[2], 1.414f);
    EXPECT_EQ(GX_INT_SQRT_TABLE[5489], 74.088f);
    for (int i = 0; i < kIntSqrtTableSize; ++i) ASSERT_EQ(GX_INT_SQRT_TABLE[i], DecimalSqrt(i)) << i;
    // Past the end: the value a longer table would hold (relief sizes up to 100+).
    for (int i = kIntSqrtTableSize; i < 2 * 110 * 110; i += 7) ASSERT_EQ(IntSqrt(i), DecimalSqrt(i)) << i;
    EXPECT_EQ(IntSqrt(-1), 0.0f);
}

TEST(SqrtTable, FastSqrtIsTheOneNewtonStepApproximation) {
    // Bit patterns of the approximation, not of the true root.
    EXPECT_EQ(fsqrt(4.0f), 1.99661434f);
    EXPECT_EQ(fsqrt(1.0f), 0.998307168f);
    for (float x : {0.5f, 2.0f, 10.0f, 1000.0f, 1e6f}) {
        EXPECT_NEAR(fsqrt(x), std::sqrt(x), std::sqrt(x) * 0.002f);
        EXPECT_NE(fsqrt(x), std::sqrt(x));
    }
}

TEST(GaussianWeights, CentreAndRoundingVariants) {
    int w[8];
    int sum = 0;
    ComputeGaussianWeights(w, &sum, 3, kShadowGaussianCentre, GaussianRounding::kDouble);
    EXPECT_EQ(w[0], 100);
    EXPECT_EQ(w[1], 60);
    EXPECT_EQ(w[2], 13);
    EXPECT_EQ(w[3], 1);
    EXPECT_EQ(sum, 248);

    ComputeGaussianWeights(w, &sum, 0, kGlowGaussianCentre, GaussianRounding::kSingle);
    EXPECT_EQ(w[0], 128);
    EXPECT_EQ(sum, 128);

    // The tail weight is 1% of the centre whatever the radius.
    int big[101];
    ComputeGaussianWeights(big, &sum, 100, kGlowGaussianCentre, GaussianRounding::kDouble);
    EXPECT_EQ(big[100], 1);
    for (int i = 1; i <= 100; ++i) EXPECT_LE(big[i], big[i - 1]);
}

}  // namespace
}  // namespace Glimmer
