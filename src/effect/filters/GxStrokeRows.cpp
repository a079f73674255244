// The stroke's row kernels, once per instruction set (see GxStrokeRows.h).
//
// Vector form: a block of output bytes is built in one register: for every
// term the two span reads are combined with a byte maximum, the cut is a
// saturating subtraction, and the block keeps the running maximum. Two
// blocks go through the first full levels together (more would rarely all
// fill up), then on alone, or in quarters of 16 bytes where only a few are
// short of 255; after each pair of full levels, blocks that are 255
// throughout skip the rest.
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

// Blocks [x, x + kBlocks * N) of the tag's width, from term `i` on, each
// starting from what `out` holds: the term's reads and its cut are fetched
// once for all of them.
template <class DB, int kBlocks>
HWY_INLINE void Finish(const Term* HWY_RESTRICT terms, int flat, int count, int i, int x, uint8_t* HWY_RESTRICT out) {
    const DB d;
    const int N = int(hn::Lanes(d));
    const auto full = hn::Set(d, 255);
    hn::Vec<DB> acc[kBlocks];
    for (int k = 0; k < kBlocks; ++k) acc[k] = hn::LoadU(d, out + x + k * N);
    auto filled = [&] {
        auto least = acc[0];
        for (int k = 1; k < kBlocks; ++k) least = hn::Min(least, acc[k]);
        return hn::AllTrue(d, hn::Eq(least, full));
    };
    if (filled()) return;
    for (; i < flat; ++i) {
        const uint8_t* a = terms[i].a + x;
        const uint8_t* b = terms[i].b + x;
        for (int k = 0; k < kBlocks; ++k)
            acc[k] = hn::Max(acc[k], hn::Max(hn::LoadU(d, a + k * N), hn::LoadU(d, b + k * N)));
        if ((i & 1) == 0) continue;
        if (filled()) break;
    }
    if (i >= flat) {
        for (i = flat; i < count; ++i) {
            const uint8_t* a = terms[i].a + x;
            const uint8_t* b = terms[i].b + x;
            const auto cut = hn::Set(d, terms[i].cut);
            for (int k = 0; k < kBlocks; ++k) {
                const auto chord = hn::Max(hn::LoadU(d, a + k * N), hn::LoadU(d, b + k * N));
                acc[k] = hn::Max(acc[k], hn::SaturatedSub(chord, cut));
            }
        }
    }
    for (int k = 0; k < kBlocks; ++k) hn::StoreU(acc[k], d, out + x + k * N);
}

// Full levels a group of blocks reads together before each block goes on
// alone: most blocks inside the stroke fill up sooner.
inline constexpr int kTogether = 8;
using D16 = hn::CappedTag<uint8_t, 16>;

// Blocks [x, x + kBlocks * N). Together while the budget lasts; then each
// block not yet full goes on alone, and one with few pixels short of 255
// goes on in quarters of 16 bytes, only those quarters that are not full:
// along the ends of the stroke most of a block fills up early and a few
// pixels read every term. Any split gives the same bytes.
template <int kBlocks>
HWY_INLINE void DilateBlocks(const Term* HWY_RESTRICT terms, int flat, int count, int x, uint8_t* HWY_RESTRICT out) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    for (int k = 0; k < kBlocks; ++k) hn::StoreU(hn::Zero(d), d, out + x + k * N);
    if (count <= 6 * kTogether) {  // few terms: splitting would not pay
        Finish<D8, kBlocks>(terms, flat, count, 0, x, out);
        return;
    }
    const int together = flat < kTogether ? flat : kTogether;
    Finish<D8, kBlocks>(terms, together, together, 0, x, out);  // full levels only
    if (together == flat && flat == count) return;
    const D16 dq;
    const int Q = int(hn::Lanes(dq));
    for (int k = 0; k < kBlocks; ++k) {
        uint8_t* block = out + x + k * N;
        if (Q < N) {
            int open = 0;
            for (int q = 0; q < N; q += Q) open += !hn::AllTrue(dq, hn::Eq(hn::LoadU(dq, block + q), hn::Set(dq, 255)));
            if (2 * open * Q <= N) {
                for (int q = 0; q < N; q += Q) Finish<D16, 1>(terms, flat, count, together, x + k * N + q, out);
                continue;
            }
        }
        Finish<D8, 1>(terms, flat, count, together, x + k * N, out);
    }
}

void DilateRow(const Term* HWY_RESTRICT terms, int flat, int count, int n, uint8_t* HWY_RESTRICT out) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    if (n < N) {
        Reference::DilateRow(terms, flat, count, n, out);
        return;
    }
    int x = 0;
    for (; x + 2 * N <= n; x += 2 * N) DilateBlocks<2>(terms, flat, count, x, out);
    for (; x + N <= n; x += N) DilateBlocks<1>(terms, flat, count, x, out);
    if (x < n) DilateBlocks<1>(terms, flat, count, n - N, out);
}

void MaxRow(const uint8_t* HWY_RESTRICT a, const uint8_t* HWY_RESTRICT b, int n, uint8_t* HWY_RESTRICT out) {
    const D8 d;
    const int N = int(hn::Lanes(d));
    int x = 0;
    for (; x + N <= n; x += N) hn::StoreU(hn::Max(hn::LoadU(d, a + x), hn::LoadU(d, b + x)), d, out + x);
    // The last bytes: one vector overlapping the one before (out is apart
    // from a and b).
    if (x < n && n >= N) {
        hn::StoreU(hn::Max(hn::LoadU(d, a + n - N), hn::LoadU(d, b + n - N)), d, out + n - N);
        x = n;
    }
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
