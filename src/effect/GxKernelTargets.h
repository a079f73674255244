#pragma once
// Plumbing shared by the kernel families (GxBlendRows, GxBlurRows): each is
// written once with Highway's portable vector operations and compiled for
// several instruction sets (the family's unit includes itself through
// hwy/foreach_target.h). Which build runs is chosen here, once, from the CPU's
// own feature bits: only Highway's headers are used, not its library, whose
// start-up code (a timer read valgrind cannot run) would keep every program of
// ours out of callgrind.
//
// A family includes GxKernelBuilds.inc inside its namespace to list its
// builds, best first, then calls Choose() and All() below.

#include <hwy/highway.h>

#include <cstdint>
#include <vector>

#if HWY_ARCH_X86
#include <cpuid.h>
#endif

namespace Glimmer::KernelTargets {

#if HWY_ARCH_X86
// F16C from CPUID itself: clang 14's __builtin_cpu_supports does not know it.
inline bool CpuHasF16c() {
    unsigned a = 0, b = 0, c = 0, d = 0;
    return __get_cpuid(1, &a, &b, &c, &d) != 0 && (c & bit_F16C) != 0;
}
#endif

// Whether this CPU (and its OS) runs code compiled for `target`: every
// feature Highway compiles that target with (hwy/ops/set_macros-inl.h).
inline bool CpuRuns(int64_t target) {
#if HWY_ARCH_X86
    __builtin_cpu_init();
    const bool sse4 = __builtin_cpu_supports("ssse3") && __builtin_cpu_supports("sse4.1") &&
                      __builtin_cpu_supports("sse4.2") && __builtin_cpu_supports("pclmul") &&
                      __builtin_cpu_supports("aes");
    const bool avx2 = sse4 && __builtin_cpu_supports("avx") && __builtin_cpu_supports("avx2") &&
                      __builtin_cpu_supports("bmi") && __builtin_cpu_supports("bmi2") &&
                      __builtin_cpu_supports("fma") && CpuHasF16c();
    const bool avx3 = avx2 && __builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512vl") &&
                      __builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512bw");
    switch (target) {
        case HWY_SSE4: return sse4;
        case HWY_AVX2: return avx2;
        case HWY_AVX3: return avx3;
        default: break;
    }
#endif
    // The baseline build (NEON on 64-bit Arm, the one-lane fallback elsewhere)
    // runs wherever the library does.
    return target == HWY_STATIC_TARGET || target == HWY_SCALAR || target == HWY_EMU128;
}

// The first build in `builds` (best first) that the CPU runs.
template <typename Table, typename Build, size_t kCount>
const Table* Choose(const Build (&builds)[kCount]) {
    for (const Build& b : builds)
        if (CpuRuns(b.target)) return b.get();
    return builds[kCount - 1].get();
}

// Every build the CPU runs, by target name, for the tests.
template <typename Variant, typename Build, size_t kCount>
std::vector<Variant> All(const Build (&builds)[kCount]) {
    std::vector<Variant> variants;
    for (const Build& b : builds)
        if (CpuRuns(b.target)) variants.push_back(Variant{hwy::TargetName(b.target), b.get()});
    return variants;
}

}  // namespace Glimmer::KernelTargets
