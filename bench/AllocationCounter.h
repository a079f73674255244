#pragma once
// Counts the heap allocations (malloc, calloc, realloc, hence new) a stretch
// of code makes, by standing in for the C library's allocator in the program
// that includes this (once). Frees are not counted.

#include <atomic>
#include <cstddef>

extern "C" void* __libc_malloc(size_t);
extern "C" void* __libc_calloc(size_t, size_t);
extern "C" void* __libc_realloc(void*, size_t);
extern "C" void __libc_free(void*);

namespace Glimmer::Bench {

inline std::atomic<bool> gCountingAllocations{false};
inline std::atomic<long> gAllocations{0};

inline void CountAllocation() {
    if (gCountingAllocations.load(std::memory_order_relaxed))
        gAllocations.fetch_add(1, std::memory_order_relaxed);
}

// Allocations made while `f` runs.
template <typename F>
long AllocationsOf(F&& f) {
    gAllocations = 0;
    gCountingAllocations = true;
    f();
    gCountingAllocations = false;
    return gAllocations;
}

}  // namespace Glimmer::Bench

extern "C" void* malloc(size_t n) {
    Glimmer::Bench::CountAllocation();
    return __libc_malloc(n);
}
extern "C" void* calloc(size_t n, size_t size) {
    Glimmer::Bench::CountAllocation();
    return __libc_calloc(n, size);
}
extern "C" void* realloc(void* p, size_t n) {
    Glimmer::Bench::CountAllocation();
    return __libc_realloc(p, n);
}
extern "C" void free(void* p) { __libc_free(p); }
