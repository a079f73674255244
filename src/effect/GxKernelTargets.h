#pragma once
// Plumbing shared by the kernel families (GxBlendRows, GxBlurRows): each is
// written once with Highway and compiled for several instruction sets, and a
// table per family is picked at first use for the CPU at hand. Included only by
// the families' own units, after hwy/highway.h.

#include <hwy/targets.h>

#include <cstdint>
#include <vector>

namespace Glimmer::KernelTargets {

// Calls `get` (the family's HWY_DYNAMIC_DISPATCH of its table getter) once
// for every compiled target the CPU supports and returns the tables by target
// name. It steers the dispatcher through its test hook, so it is meant for
// tests, before any other thread renders; the families' Active() tables are
// fixed at their first use and do not change.
template <typename Variant, typename Get>
std::vector<Variant> EachTarget(Get get) {
    std::vector<Variant> variants;
    for (int64_t targets = hwy::SupportedTargets() & HWY_TARGETS; targets != 0; targets &= targets - 1) {
        const int64_t target = targets & -targets;
        hwy::SetSupportedTargetsForTest(target);
        hwy::GetChosenTarget().Update(hwy::SupportedTargets());
        variants.push_back(Variant{hwy::TargetName(target), get()});
    }
    hwy::SetSupportedTargetsForTest(0);
    hwy::GetChosenTarget().Update(hwy::SupportedTargets());
    return variants;
}

}  // namespace Glimmer::KernelTargets
