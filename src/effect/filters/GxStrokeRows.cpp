// The stroke's row kernels, once per instruction set (see GxStrokeRows.h).
//
// Vector form: a block of output bytes is built in one register: for every
// term the two span reads are combined with a byte maximum, the cut is a
// saturating subtraction, and the block keeps the running maximum. After
// each pair of flat terms a block that is 255 throughout is stored at once.
// A row that does not end on a whole block finishes with one block that
// overlaps the one before it (the bytes it writes twice are the same), so
// nothing outside [0, n) is read or written; a row narrower than one block
// takes the reference, as every row does in the fallback build for x86-64
// CPUs without SSE4 (Highway's one-lane "scalar" target).

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effect/filters/GxStrokeRows.cpp"
#include <hwy/foreach_target.h>  // IWYU pragma: keep
#include <hwy/highway.h>

#include "effect/filters/GxStrokeRows.h"

HWY_BEFORE_NAMESPACE();
namespace Glimmer::StrokeRows::HWY_NAMESPACE {

#if HWY_TARGET == HWY_SCALAR

const Table* GetTable() { return &ReferenceTable(); }

#else

namespace hn = hwy::HWY_NAMESPACE;
using D8 = hn::ScalableTag<uint8_t>;

HWY_INLINE hn::Vec<D8> DilateBlock(const Term* terms, int flat, int count, int x) {
    const D8 d;
    const auto full = hn::Set(d, 255);
    auto acc = hn::Zero(d);
    int i = 0;
    for (; i + 1 < flat; i += 2) {
        acc = hn::Max(acc, hn::Max(hn::LoadU(d, terms[i].a + x), hn::LoadU(d, terms[i].b + x)));
        acc = hn::Max(acc, hn::Max(hn::LoadU(d, terms[i + 1].a + x), hn::LoadU(d, terms[i + 1].b + x)));
        if (hn::AllTrue(d, hn::Eq(acc, full))) return acc;
    }
    if (i < flat) acc = hn::Max(acc, hn::Max(hn::LoadU(d, terms[i].a + x), hn::LoadU(d, terms[i].b + x)));
    for (i = flat; i < count; ++i) {
        const auto chord = hn::Max(hn::LoadU(d, terms[i].a + x), hn::LoadU(d, terms[i].b + x));
        acc = hn::Max(acc, hn::SaturatedSub(chord, hn::Set(d, terms[i].cut)));
    }
    return acc;
}

void DilateRow(const Term* HWY_RESTRICT terms, int flat, int count, int n, uint8_t* HWY_RESTRICT out) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    if (n < N) {
        Reference::DilateRow(terms, flat, count, n, out);
        return;
    }
    int x = 0;
    for (; x + N <= n; x += N) hn::StoreU(DilateBlock(terms, flat, count, x), d, out + x);
    if (x < n) hn::StoreU(DilateBlock(terms, flat, count, n - N), d, out + n - N);
}

void MaxRow(const uint8_t* HWY_RESTRICT a, const uint8_t* HWY_RESTRICT b, int n, uint8_t* HWY_RESTRICT out) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    int x = 0;
    for (; x + N <= n; x += N) hn::StoreU(hn::Max(hn::LoadU(d, a + x), hn::LoadU(d, b + x)), d, out + x);
    for (; x < n; ++x) out[x] = a[x] > b[x] ? a[x] : b[x];
}

void MinRow(uint8_t* HWY_RESTRICT out, const uint8_t* HWY_RESTRICT other, int n) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    int x = 0;
    for (; x + N <= n; x += N) hn::StoreU(hn::Min(hn::LoadU(d, out + x), hn::LoadU(d, other + x)), d, out + x);
    for (; x < n; ++x) out[x] = out[x] < other[x] ? out[x] : other[x];
}

const Table* GetTable() {
    static const Table table = {DilateRow, MaxRow, MinRow};
    return &table;
}

#endif

}  // namespace Glimmer::StrokeRows::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "effect/GxKernelTargets.h"

namespace Glimmer::StrokeRows {

namespace Reference {
void DilateRow(const Term* terms, int /*flat*/, int count, int n, uint8_t* out) {
    for (int x = 0; x < n; ++x) {
        int best = 0;
        for (int i = 0; i < count; ++i) {
            const int chord = terms[i].a[x] > terms[i].b[x] ? terms[i].a[x] : terms[i].b[x];
            const int v = chord - terms[i].cut;
            best = v > best ? v : best;
            if (best == 255) break;  // nothing is larger
        }
        out[x] = uint8_t(best);
    }
}
void MaxRow(const uint8_t* a, const uint8_t* b, int n, uint8_t* out) {
    for (int x = 0; x < n; ++x) out[x] = a[x] > b[x] ? a[x] : b[x];
}
void MinRow(uint8_t* out, const uint8_t* other, int n) {
    for (int x = 0; x < n; ++x) out[x] = out[x] < other[x] ? out[x] : other[x];
}
}  // namespace Reference

const Table& ReferenceTable() {
    static const Table table = {Reference::DilateRow, Reference::MaxRow, Reference::MinRow};
    return table;
}

#include "effect/GxKernelBuilds.inc"

const Table& Active() {
    static const Table* table = KernelTargets::Choose<Table>(kBuilds);
    return *table;
}

std::vector<Variant> Variants() { return KernelTargets::All<Variant>(kBuilds); }

}  // namespace Glimmer::StrokeRows
#endif  // HWY_ONCE
