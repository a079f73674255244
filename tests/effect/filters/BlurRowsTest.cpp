#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <set>
#include <vector>

#include "effect/filters/GxBlurRows.h"
#include "effect/filters/GxGaussian.h"

namespace Glimmer {
namespace {

struct Variant {
    int centre;
    GaussianRounding rounding;
};
constexpr Variant kVariants[] = {{kShadowGaussianCentre, GaussianRounding::kDouble},
                                 {kShadowGaussianCentre, GaussianRounding::kSingle},
                                 {kGlowGaussianCentre, GaussianRounding::kDouble},
                                 {kGlowGaussianCentre, GaussianRounding::kSingle}};

std::set<uint32_t> SumsUpTo(int radius) {
    std::set<uint32_t> sums;
    GxGaussian g;
    for (const Variant& v : kVariants)
        for (int r = 0; r <= radius; ++r)
            if (PlanGaussian(&g, r, v.centre, v.rounding)) sums.insert(g.sum);
    return sums;
}

// Every dividend a blur can produce, for every total the stack can ask for
// (sizes are clamped to 0..100, so no radius goes past 100).
TEST(GxDivisor, EqualsTheDivisionForEveryBlurSumOfTheStacksRadii) {
    for (uint32_t s : SumsUpTo(100)) {
        const GxDivisor d = GxDivisor::For(s, 255ull * s);
        for (uint32_t x = 0; x <= 255 * s; ++x) ASSERT_EQ(d(x), x / s) << x << " / " << s;
    }
}

// Beyond them, up to the largest radius a filter accepts: both ends of every
// quotient's run of dividends (the quotients of both forms never decrease, so
// the ends decide the whole run), and m small enough for 32-bit vector lanes.
TEST(GxDivisor, EqualsTheDivisionAtEveryQuotientBoundaryUpToTheLargestRadius) {
    const std::set<uint32_t> sums = SumsUpTo(kMaxFilterRadius);
    EXPECT_LT(*sums.rbegin(), 1u << 17);
    for (uint32_t s : sums) {
        const GxDivisor d = GxDivisor::For(s, 255ull * s);
        ASSERT_LT(d.multiplier, 1ull << 32) << s;
        for (uint64_t q = 0; q < 255; ++q) {
            ASSERT_EQ(d(q * s), q) << s;
            ASSERT_EQ(d(q * s + s - 1), q) << s;
        }
        ASSERT_EQ(d(255ull * s), 255u) << s;
    }
    GxGaussian g;
    EXPECT_FALSE(PlanGaussian(&g, kMaxFilterRadius + 1, kShadowGaussianCentre, GaussianRounding::kSingle));
    EXPECT_FALSE(PlanGaussian(&g, 3, 200, GaussianRounding::kSingle));  // pairs would leave 16 bits
}

// Every compiled kernel beside the reference: random planes, every width from
// 1 to 64 and some long ones, along a row and down a column, plain and
// inverted, outputs poisoned with random bytes first.
TEST(BlurRows, EveryKernelGivesTheReferenceBytes) {
    std::mt19937 random(7);
    auto bytes = [&](size_t n) {
        std::vector<uint8_t> v(n);
        for (auto& b : v) b = uint8_t(random());
        return v;
    };
    const auto variants = BlurRows::Variants();
    ASSERT_FALSE(variants.empty());
    std::vector<int> widths;
    for (int n = 1; n <= 64; ++n) widths.push_back(n);
    widths.insert(widths.end(), {200, 1031, 4099});

    for (int radius : {0, 1, 2, 3, 7, 20}) {
        const Variant& kind = kVariants[radius % 4];
        GxGaussian g;
        ASSERT_TRUE(PlanGaussian(&g, radius, kind.centre, kind.rounding));
        for (int n : widths) {
            for (ptrdiff_t step : {ptrdiff_t(1), ptrdiff_t(n + 2 * radius + 5)}) {
                // A plane with `radius` steps of samples on either side of the
                // row and one more below (for the two-row kernels).
                const size_t margin = size_t(radius) * size_t(step);
                std::vector<uint8_t> plane = bytes(2 * margin + size_t(step) + size_t(n) + 8);
                // Mostly full or empty, as masks are, with random edges.
                for (size_t i = 0; i < plane.size(); i += 3) plane[i] = plane[i] & 1 ? 255 : 0;
                const uint8_t* centre = plane.data() + margin;
                for (bool inverted : {false, true}) {
                    std::vector<uint8_t> expected = bytes(size_t(n)), below = bytes(size_t(n));
                    BlurRows::Reference::BlurRow(centre, step, n, g, inverted, expected.data());
                    BlurRows::Reference::BlurRow(centre + step, step, n, g, inverted, below.data());
                    for (const auto& v : variants) {
                        std::vector<uint8_t> got = bytes(size_t(n)), first = bytes(size_t(n)), second = bytes(size_t(n));
                        v.table->blurRow(centre, step, n, g, inverted, got.data());
                        v.table->blurRows2(centre, step, n, g, inverted, first.data(), second.data());
                        ASSERT_TRUE(got == expected && first == expected && second == below)
                            << v.name << " radius " << radius << " width " << n << " step " << step
                            << (inverted ? " inverted" : "");
                    }
                }
            }
        }
    }
}

// The glow's spread beside its reference, likewise: random rows, one output
// row and two, every width from 3 to 66 and some long ones, the two end bytes
// left alone.
TEST(BlurRows, EverySpreadKernelGivesTheReferenceBytes) {
    std::mt19937 random(11);
    auto bytes = [&](size_t n) {
        std::vector<uint8_t> v(n);
        for (auto& b : v) b = uint8_t(random() % 3 == 0 ? 255 : random());
        return v;
    };
    std::vector<int> widths;
    for (int w = 3; w <= 66; ++w) widths.push_back(w);
    widths.insert(widths.end(), {201, 1032, 4100});
    for (int w : widths) {
        const std::vector<uint8_t> rows = bytes(4 * size_t(w));
        const uint8_t* above = rows.data();
        std::vector<uint8_t> expected = bytes(size_t(w));
        const std::vector<uint8_t> poison = expected;
        std::vector<uint8_t> below = poison;
        BlurRows::Reference::SpreadRow(above, above + w, above + 2 * w, w, expected.data());
        BlurRows::Reference::SpreadRow(above + w, above + 2 * w, above + 3 * w, w, below.data());
        for (const auto& v : BlurRows::Variants()) {
            std::vector<uint8_t> got = poison, first = poison, second = poison;
            v.table->spreadRow(above, above + w, above + 2 * w, w, got.data());
            v.table->spreadRows2(above, above + w, above + 2 * w, above + 3 * w, w, first.data(), second.data());
            ASSERT_TRUE(got == expected && first == expected && second == below) << v.name << " width " << w;
        }
    }
}

// The glow's colouring beside its reference: random values and table, every
// width from 1 to 64 and some long ones, outputs poisoned.
TEST(BlurRows, EveryShadeKernelGivesTheReferenceWords) {
    std::mt19937 random(13);
    std::vector<uint32_t> table(257);
    for (auto& w : table) w = random();
    std::vector<int> widths;
    for (int n = 1; n <= 64; ++n) widths.push_back(n);
    widths.insert(widths.end(), {200, 1031});
    for (int n : widths) {
        std::vector<uint8_t> values(static_cast<size_t>(n));
        for (auto& v : values) v = uint8_t(random());
        std::vector<uint32_t> expected(static_cast<size_t>(n) + 4, 0xDEADBEEFu);
        const std::vector<uint32_t> poison = expected;
        BlurRows::Reference::ShadeRow(values.data(), n, table.data(), expected.data());
        for (const auto& v : BlurRows::Variants()) {
            std::vector<uint32_t> got = poison;
            v.table->shadeRow(values.data(), n, table.data(), got.data());
            ASSERT_EQ(got, expected) << v.name << " width " << n;
        }
    }
}

}  // namespace
}  // namespace Glimmer
