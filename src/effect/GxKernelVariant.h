#pragma once
// One compiled build of a kernel family, for the tests that run every build
// the CPU has against the family's reference table.

namespace Glimmer::KernelTargets {

template <typename Table>
struct Variant {
    const char* name;  // Highway's name of the target
    const Table* table;
};

}  // namespace Glimmer::KernelTargets
