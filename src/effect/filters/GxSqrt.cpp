#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

// The same k as RoundedSqrt, found incrementally: k never decreases as i
// grows, so one step up per thousandth of the largest root fills the whole
// table (about 80,000 steps where a search per entry takes millions, more
// than a compiler's default budget for constant evaluation).
constexpr std::array<float, kIntSqrtTableSize> MakeSqrtTable() {
    std::array<float, kIntSqrtTableSize> table{};
    uint64_t k = 0;
    for (uint32_t i = 0; i < uint32_t(kIntSqrtTableSize); ++i) {
        const uint64_t target = uint64_t(4000000) * i;
        while ((2 * k + 1) * (2 * k + 1) <= target) ++k;  // largest k with (2k - 1)^2 <= target
        table[i] = float(double(k) / 1000.0);
    }
    return table;
}

}  // namespace

constinit const std::array<float, kIntSqrtTableSize> GX_INT_SQRT_TABLE = MakeSqrtTable();

static_assert(MakeSqrtTable()[2] == 1.414f && MakeSqrtTable()[3] == 1.732f);
static_assert(MakeSqrtTable()[6] == 2.449f && MakeSqrtTable()[kIntSqrtTableSize - 1] == 74.088f);
static_assert(MakeSqrtTable()[4321] == RoundedSqrt(4321) && MakeSqrtTable()[5000] == RoundedSqrt(5000));

}  // namespace Glimmer
