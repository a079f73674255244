#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

constexpr std::array<float, kIntSqrtTableSize> MakeSqrtTable() {
    std::array<float, kIntSqrtTableSize> table{};
    for (int i = 0; i < kIntSqrtTableSize; ++i) table[i] = RoundedSqrt(uint32_t(i));
    return table;
}

}  // namespace

constinit const std::array<float, kIntSqrtTableSize> GX_INT_SQRT_TABLE = MakeSqrtTable();

static_assert(MakeSqrtTable()[2] == 1.414f && MakeSqrtTable()[3] == 1.732f);
static_assert(MakeSqrtTable()[6] == 2.449f && MakeSqrtTable()[kIntSqrtTableSize - 1] == 74.088f);

}  // namespace Glimmer
