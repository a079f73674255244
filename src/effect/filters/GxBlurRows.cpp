// The blur row kernel, once per instruction set (see GxBlurRows.h).
//
// The glow's spread and colouring follow at the end.
//
// Vector form: 8-bit taps are widened to 16 bits, the two taps of a pair
// added (at most 510) and multiplied by their weight (at most 128, so the
// product stays below 2^16), and the products summed in 32-bit lanes, half a
// vector each; on x86 two such pairs share one pairwise multiply-add
// (BlurBlocksPaired). Two neighbouring rows down the columns load each
// sample once for both (BlurRowsPaired); two spread rows share the sum of
// their two middle rows. The division is GxDivisor's (x * m) >> s with a
// 64-bit product: even and odd 32-bit lanes are multiplied apart (MulEven)
// and put back together. A row that does not end on a whole vector ends with one that
// overlaps the one before it (outputs never alias inputs, so the bytes written
// twice are alike); rows narrower than a vector take the scalar form of the
// same arithmetic, as does every row in the fallback build for x86-64 CPUs
// without SSE4 (Highway's one-lane "scalar" target).

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effect/filters/GxBlurRows.cpp"
#include <hwy/foreach_target.h>  // IWYU pragma: keep
#include <hwy/highway.h>

#include "effect/filters/GxBlurRows.h"

HWY_BEFORE_NAMESPACE();
namespace Glimmer::BlurRows::HWY_NAMESPACE {
namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET != HWY_SCALAR
// Quotient lanes of a 32-bit vector, exact for sums up to 255 * S.
template <class D32, class V32 = hn::Vec<D32>>
HWY_INLINE V32 Divide(D32 d32, V32 x, V32 multiplier, int shift) {
    const hn::Repartition<uint64_t, D32> d64;
    auto even = hn::MulEven(x, multiplier);
    auto odd = hn::MulEven(hn::BitCast(d32, hn::ShiftRight<32>(hn::BitCast(d64, x))), multiplier);
    even = hn::ShiftRightSame(even, shift);
    odd = hn::ShiftRightSame(odd, shift);
    return hn::BitCast(d32, hn::Or(even, hn::ShiftLeft<32>(odd)));
}
#endif

#if HWY_ARCH_X86 && HWY_TARGET != HWY_SCALAR && HWY_TARGET != HWY_EMU128
// x86: two taps per multiply. Interleaving the 16-bit samples of taps t and
// t + 1 puts them side by side in each 32-bit lane, and the pairwise
// multiply-add (pmaddwd) gives w_t * s_t + w_(t+1) * s_(t+1) for one column
// per lane: pairs are at most 510 and weights at most 128, so every product
// and sum stays far inside the signed lanes. The lower and upper interleaves
// take the columns of each 128-bit block in halves, and the saturating pack
// at the end (also per block) puts them back in order.
template <class D16>
struct PairedTaps {
    using D8 = hn::Rebind<uint8_t, D16>;
    using DI32 = hn::Repartition<int32_t, D16>;
    using DU32 = hn::Repartition<uint32_t, D16>;
    using DI16 = hn::Repartition<int16_t, D16>;
    using V16 = hn::Vec<DI16>;
    using V32 = hn::Vec<DI32>;
    D8 d8;
    DI32 di32;
    DU32 du32;
    DI16 di16;
    hn::Vec<DU32> multiplier, full, most;
    int shift;
    bool inverted;
    // Weights of taps 2k and 2k + 1 as one 32-bit pattern (0 past the last tap).
    uint32_t pairs[kMaxFilterRadius / 2 + 1];

    HWY_INLINE PairedTaps(const GxGaussian& g, bool invert)
        : multiplier(hn::Set(du32, uint32_t(g.divide.multiplier))),
          full(hn::Set(du32, g.full)),
          most(hn::Set(du32, 255u)),
          shift(int(g.divide.shift)),
          inverted(invert) {
        const int R = g.radius;
        for (int i = 0; i <= R; i += 2)
            pairs[i / 2] = uint32_t(g.weights[i]) | (i < R ? uint32_t(g.weights[i + 1]) << 16 : 0u);
    }
    HWY_INLINE V16 weightsOf(int i) const { return hn::BitCast(di16, hn::Set(du32, pairs[i / 2])); }
    // lo/hi += the weights of a tap pair times the samples a (tap 2k) and b (tap 2k + 1).
    HWY_INLINE void accumulate(V16 a, V16 b, V16 wv, V32& lo, V32& hi) const {
        V32 unused = hn::Zero(di32);  // the second sum, which these lanes never need
        lo = hn::ReorderWidenMulAccumulate(di32, hn::InterleaveLower(di16, a, b), wv, lo, unused);
        hi = hn::ReorderWidenMulAccumulate(di32, hn::InterleaveUpper(di16, a, b), wv, hi, unused);
    }
    // The sums divided by the weight sum (inverted first if asked), as bytes.
    HWY_INLINE void finish(V32 lo, V32 hi, uint8_t* to) const {
        auto sumLo = hn::BitCast(du32, lo), sumHi = hn::BitCast(du32, hi);
        if (inverted) {
            sumLo = hn::Sub(full, sumLo);
            sumHi = hn::Sub(full, sumHi);
        }
        const auto qLo = hn::BitCast(di32, hn::Min(Divide(du32, sumLo, multiplier, shift), most));
        const auto qHi = hn::BitCast(di32, hn::Min(Divide(du32, sumHi, multiplier, shift), most));
        hn::StoreU(hn::DemoteTo(d8, hn::ReorderDemote2To(di16, qLo, qHi)), d8, to);
    }
};

template <class D16>
HWY_INLINE int BlurBlocksPaired(D16 d16, const uint8_t* HWY_RESTRICT c, ptrdiff_t step, int n,
                                const GxGaussian& g, bool inverted, uint8_t* HWY_RESTRICT out) {
    const int R = g.radius;
    const int N = int(hn::Lanes(d16));
    const PairedTaps<D16> taps(g, inverted);
    const auto d8 = taps.d8;
    const auto di16 = taps.di16;
    const auto di32 = taps.di32;
    auto pair = [&](const uint8_t* at, ptrdiff_t offset) {
        return hn::BitCast(di16, hn::Add(hn::PromoteTo(d16, hn::LoadU(d8, at - offset)),
                                         hn::PromoteTo(d16, hn::LoadU(d8, at + offset))));
    };
    auto finish = [&](auto lo, auto hi, uint8_t* to) { taps.finish(lo, hi, to); };
    auto accumulate = [&](auto a, auto b, auto wv, auto& lo, auto& hi) { taps.accumulate(a, b, wv, lo, hi); };
    auto weightsOf = [&](int i) { return taps.weightsOf(i); };
    int x = 0;
    // Two blocks at a time share the weights and the loop.
    for (; x + 2 * N <= n; x += 2 * N) {
        const uint8_t* at = c + x;
        auto lo0 = hn::Zero(di32), hi0 = hn::Zero(di32), lo1 = hn::Zero(di32), hi1 = hn::Zero(di32);
        const auto first = R >= 1 ? step : 0;
        const auto w0 = weightsOf(0);
        accumulate(hn::BitCast(di16, hn::PromoteTo(d16, hn::LoadU(d8, at))),
                   R >= 1 ? pair(at, first) : hn::Zero(di16), w0, lo0, hi0);
        accumulate(hn::BitCast(di16, hn::PromoteTo(d16, hn::LoadU(d8, at + N))),
                   R >= 1 ? pair(at + N, first) : hn::Zero(di16), w0, lo1, hi1);
        int i = 2;
        for (; i < R; i += 2) {
            const auto wv = weightsOf(i);
            const ptrdiff_t o0 = ptrdiff_t(i) * step, o1 = o0 + step;
            accumulate(pair(at, o0), pair(at, o1), wv, lo0, hi0);
            accumulate(pair(at + N, o0), pair(at + N, o1), wv, lo1, hi1);
        }
        if (i == R) {
            const auto wv = weightsOf(i);
            accumulate(pair(at, ptrdiff_t(R) * step), hn::Zero(di16), wv, lo0, hi0);
            accumulate(pair(at + N, ptrdiff_t(R) * step), hn::Zero(di16), wv, lo1, hi1);
        }
        finish(lo0, hi0, out + x);
        finish(lo1, hi1, out + x + N);
    }
    auto single = [&](int x) {
        const uint8_t* at = c + x;
        auto lo = hn::Zero(di32), hi = hn::Zero(di32);
        accumulate(hn::BitCast(di16, hn::PromoteTo(d16, hn::LoadU(d8, at))), R >= 1 ? pair(at, step) : hn::Zero(di16),
                   weightsOf(0), lo, hi);
        int i = 2;
        for (; i < R; i += 2)
            accumulate(pair(at, ptrdiff_t(i) * step), pair(at, ptrdiff_t(i + 1) * step), weightsOf(i), lo, hi);
        if (i == R) accumulate(pair(at, ptrdiff_t(R) * step), hn::Zero(di16), weightsOf(i), lo, hi);
        finish(lo, hi, out + x);
    };
    for (; x + N <= n; x += N) single(x);
    // The last columns: one block that overlaps the one before (its bytes
    // are worked out again, alike; out never aliases the samples).
    if (x < n && n >= N) {
        single(n - N);
        x = n;
    }
    return x;
}

// Two rows at once, the second centred one step past the first: each block
// loads the samples of the R + 1 steps either side once for both (rows
// s[-R] .. s[R + 1]), each carried into the next pair of taps.
template <class D16>
HWY_INLINE bool BlurRowsPaired(D16 d16, const uint8_t* HWY_RESTRICT c, ptrdiff_t step, int n, const GxGaussian& g,
                               bool inverted, uint8_t* HWY_RESTRICT out0, uint8_t* HWY_RESTRICT out1) {
    const int R = g.radius;
    const int N = int(hn::Lanes(d16));
    if (n < N) return false;
    const PairedTaps<D16> taps(g, inverted);
    using V16 = typename PairedTaps<D16>::V16;
    const auto d8 = taps.d8;
    const auto di16 = taps.di16;
    const auto di32 = taps.di32;
    auto finish = [&](auto lo, auto hi, uint8_t* to) { taps.finish(lo, hi, to); };
    auto accumulate = [&](auto a, auto b, auto wv, auto& lo, auto& hi) { taps.accumulate(a, b, wv, lo, hi); };
    auto weightsOf = [&](int i) { return taps.weightsOf(i); };
    auto block = [&](int x) {
        const uint8_t* at = c + x;
        auto s = [&](int k) { return hn::BitCast(di16, hn::PromoteTo(d16, hn::LoadU(d8, at + ptrdiff_t(k) * step))); };
        auto lo0 = hn::Zero(di32), hi0 = hn::Zero(di32), lo1 = hn::Zero(di32), hi1 = hn::Zero(di32);
        const V16 s0 = s(0), s1 = s(1);
        if (R == 0) {
            accumulate(s0, hn::Zero(di16), weightsOf(0), lo0, hi0);
            accumulate(s1, hn::Zero(di16), weightsOf(0), lo1, hi1);
        } else {
            // Taps 0 and 1: row 0 takes s0 and s[-1] + s1, row 1 takes s1 and s0 + s2.
            V16 carriedLow = s(-1), carriedHigh = s(2);
            accumulate(s0, hn::Add(carriedLow, s1), weightsOf(0), lo0, hi0);
            accumulate(s1, hn::Add(s0, carriedHigh), weightsOf(0), lo1, hi1);
            // Taps i and i + 1 with C = s[1 - i] and D = s[i] carried in:
            // row 0 takes s[-i] + D and s[-i - 1] + s[i + 1], row 1 takes
            // C + s[i + 1] and s[-i] + s[i + 2].
            int i = 2;
            for (; i < R; i += 2) {
                const V16 a = s(-i - 1), b = s(-i), e = s(i + 1), f = s(i + 2);
                const auto wv = weightsOf(i);
                accumulate(hn::Add(b, carriedHigh), hn::Add(a, e), wv, lo0, hi0);
                accumulate(hn::Add(carriedLow, e), hn::Add(b, f), wv, lo1, hi1);
                carriedLow = a;
                carriedHigh = f;
            }
            if (i == R) {
                const V16 b = s(-R), e = s(R + 1);
                const auto wv = weightsOf(R);
                accumulate(hn::Add(b, carriedHigh), hn::Zero(di16), wv, lo0, hi0);
                accumulate(hn::Add(carriedLow, e), hn::Zero(di16), wv, lo1, hi1);
            }
        }
        finish(lo0, hi0, out0 + x);
        finish(lo1, hi1, out1 + x);
    };
    int x = 0;
    for (; x + N <= n; x += N) block(x);
    if (x < n) block(n - N);  // overlaps the block before: the same bytes again
    return true;
}
#endif

void BlurRow(const uint8_t* HWY_RESTRICT c, ptrdiff_t step, int n, const GxGaussian& g, bool inverted,
             uint8_t* HWY_RESTRICT out) {
    const int R = g.radius;
    const int* w = g.weights;
    int x = 0;
#if HWY_ARCH_X86 && HWY_TARGET != HWY_SCALAR && HWY_TARGET != HWY_EMU128
    x = BlurBlocksPaired(hn::ScalableTag<uint16_t>(), c, step, n, g, inverted, out);
#elif HWY_TARGET != HWY_SCALAR
    const hn::ScalableTag<uint16_t> d16;
    const hn::Rebind<uint8_t, decltype(d16)> d8;
    const hn::Half<decltype(d16)> dh16;
    const hn::Rebind<uint32_t, decltype(dh16)> d32;
    const hn::Rebind<int32_t, decltype(dh16)> di32;
    const hn::Rebind<uint8_t, decltype(dh16)> dh8;
    const int N = int(hn::Lanes(d16));
    const int half = int(hn::Lanes(d32));
    const auto multiplier = hn::Set(d32, uint32_t(g.divide.multiplier));
    const int shift = int(g.divide.shift);
    const auto full = hn::Set(d32, g.full);
    const auto most = hn::Set(d32, 255u);
    auto block = [&](int x) {
        const auto centre = hn::Mul(hn::PromoteTo(d16, hn::LoadU(d8, c + x)), hn::Set(d16, uint16_t(w[0])));
        auto lo = hn::PromoteTo(d32, hn::LowerHalf(dh16, centre));
        auto hi = hn::PromoteTo(d32, hn::UpperHalf(dh16, centre));
        for (int i = 1; i <= R; ++i) {
            const ptrdiff_t offset = ptrdiff_t(i) * step;
            const auto pair = hn::Add(hn::PromoteTo(d16, hn::LoadU(d8, c + x - offset)),
                                      hn::PromoteTo(d16, hn::LoadU(d8, c + x + offset)));
            const auto product = hn::Mul(pair, hn::Set(d16, uint16_t(w[i])));
            lo = hn::Add(lo, hn::PromoteTo(d32, hn::LowerHalf(dh16, product)));
            hi = hn::Add(hi, hn::PromoteTo(d32, hn::UpperHalf(dh16, product)));
        }
        if (inverted) {
            lo = hn::Sub(full, lo);
            hi = hn::Sub(full, hi);
        }
        lo = hn::Min(Divide(d32, lo, multiplier, shift), most);
        hi = hn::Min(Divide(d32, hi, multiplier, shift), most);
        hn::StoreU(hn::DemoteTo(dh8, hn::BitCast(di32, lo)), dh8, out + x);
        hn::StoreU(hn::DemoteTo(dh8, hn::BitCast(di32, hi)), dh8, out + x + half);
    };
    for (; x + N <= n; x += N) block(x);
    // The last columns: one block that overlaps the one before (its bytes
    // are worked out again, alike; out never aliases the samples).
    if (x < n && n >= N) {
        block(n - N);
        x = n;
    }
#endif
    // A row narrower than a vector; every row in the build for CPUs without
    // the vector instructions.
    for (; x < n; ++x) {
        uint32_t sum = uint32_t(w[0]) * c[x];
        for (int i = 1; i <= R; ++i) {
            const ptrdiff_t offset = ptrdiff_t(i) * step;
            sum += uint32_t(w[i]) * (uint32_t(c[x - offset]) + c[x + offset]);
        }
        const uint32_t v = g.divide(inverted ? g.full - sum : sum);
        out[x] = uint8_t(v < 255 ? v : 255);
    }
}

void BlurRows2(const uint8_t* HWY_RESTRICT c, ptrdiff_t step, int n, const GxGaussian& g, bool inverted,
               uint8_t* HWY_RESTRICT out0, uint8_t* HWY_RESTRICT out1) {
#if HWY_ARCH_X86 && HWY_TARGET != HWY_SCALAR && HWY_TARGET != HWY_EMU128
    if (BlurRowsPaired(hn::ScalableTag<uint16_t>(), c, step, n, g, inverted, out0, out1)) return;
#endif
    BlurRow(c, step, n, g, inverted, out0);
    BlurRow(c + step, step, n, g, inverted, out1);
}

void SpreadRow(const uint8_t* HWY_RESTRICT above, const uint8_t* HWY_RESTRICT row,
               const uint8_t* HWY_RESTRICT below, int width, uint8_t* HWY_RESTRICT out) {
    int x = 1;
#if HWY_TARGET != HWY_SCALAR
    // Column sums up to 765, their sum of three up to 2295: 16-bit lanes.
    const hn::ScalableTag<uint16_t> d16;
    const hn::Rebind<uint8_t, decltype(d16)> d8;
    const int N = int(hn::Lanes(d16));
    auto column = [&](int at) {
        return hn::Add(hn::Add(hn::PromoteTo(d16, hn::LoadU(d8, above + at)), hn::PromoteTo(d16, hn::LoadU(d8, row + at))),
                       hn::PromoteTo(d16, hn::LoadU(d8, below + at)));
    };
    auto block = [&](int at) {
        const auto sum = hn::Add(hn::Add(column(at - 1), column(at)), column(at + 1));
        const auto v = hn::Min(hn::ShiftRight<2>(sum), hn::Set(d16, 255));
        hn::StoreU(hn::DemoteTo(d8, hn::BitCast(hn::Rebind<int16_t, decltype(d16)>(), v)), d8, out + at);
    };
    for (; x + N + 1 <= width; x += N) block(x);
    // The last columns: one block that overlaps the one before (out never
    // aliases the rows it reads).
    if (x + 1 < width && width >= N + 2) {
        block(width - 1 - N);
        x = width - 1;
    }
#endif
    for (; x + 1 < width; ++x) {
        unsigned s = 0;
        for (int k = -1; k <= 1; ++k) s += unsigned(above[x + k]) + row[x + k] + below[x + k];
        s >>= 2;
        out[x] = uint8_t(s > 255 ? 255 : s);
    }
}

void SpreadRows2(const uint8_t* HWY_RESTRICT above, const uint8_t* HWY_RESTRICT row, const uint8_t* HWY_RESTRICT next,
                 const uint8_t* HWY_RESTRICT below, int width, uint8_t* HWY_RESTRICT out0, uint8_t* HWY_RESTRICT out1) {
#if HWY_TARGET != HWY_SCALAR
    // The two middle rows' sum serves both outputs.
    const hn::ScalableTag<uint16_t> d16;
    const hn::Rebind<uint8_t, decltype(d16)> d8;
    const int N = int(hn::Lanes(d16));
    if (width >= N + 2) {
        auto at16 = [&](const uint8_t* p, int at) { return hn::PromoteTo(d16, hn::LoadU(d8, p + at)); };
        auto finish = [&](hn::Vec<decltype(d16)> sum, uint8_t* to) {
            const auto v = hn::Min(hn::ShiftRight<2>(sum), hn::Set(d16, 255));
            hn::StoreU(hn::DemoteTo(d8, hn::BitCast(hn::Rebind<int16_t, decltype(d16)>(), v)), d8, to);
        };
        auto block = [&](int at) {
            auto first = hn::Zero(d16), second = hn::Zero(d16);
            for (int k = -1; k <= 1; ++k) {
                const auto middle = hn::Add(at16(row, at + k), at16(next, at + k));
                first = hn::Add(first, hn::Add(middle, at16(above, at + k)));
                second = hn::Add(second, hn::Add(middle, at16(below, at + k)));
            }
            finish(first, out0 + at);
            finish(second, out1 + at);
        };
        int x = 1;
        for (; x + N + 1 <= width; x += N) block(x);
        if (x + 1 < width) block(width - 1 - N);  // overlaps the block before: the same bytes again
        return;
    }
#endif
    SpreadRow(above, row, next, width, out0);
    SpreadRow(row, next, below, width, out1);
}

void ShadeRow(const uint8_t* HWY_RESTRICT values, int n, const uint32_t* HWY_RESTRICT table,
              uint32_t* HWY_RESTRICT out) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const hn::ScalableTag<int32_t> di32;
    const hn::Rebind<uint8_t, decltype(di32)> d8;
    const hn::Rebind<uint32_t, decltype(di32)> du32;
    const int N = int(hn::Lanes(di32));
    const auto* words = reinterpret_cast<const int32_t*>(table);
    auto block = [&](int at) {
        const auto index = hn::BitCast(di32, hn::PromoteTo(du32, hn::LoadU(d8, values + at)));
        hn::StoreU(hn::BitCast(du32, hn::GatherIndex(di32, words, index)), du32, out + at);
    };
    for (; x + N <= n; x += N) block(x);
    if (x < n && n >= N) {  // one block overlapping the one before
        block(n - N);
        x = n;
    }
#endif
    for (; x < n; ++x) out[x] = table[values[x]];
}

const Table* GetTable() {
    static const Table table = {BlurRow, SpreadRow, ShadeRow, BlurRows2, SpreadRows2};
    return &table;
}

}  // namespace Glimmer::BlurRows::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "effect/GxKernelTargets.h"

namespace Glimmer::BlurRows {

namespace Reference {
void BlurRow(const uint8_t* c, ptrdiff_t step, int n, const GxGaussian& g, bool inverted, uint8_t* out) {
    for (int x = 0; x < n; ++x) {
        uint32_t sum = uint32_t(g.weights[0]) * c[x];
        for (int i = 1; i <= g.radius; ++i) {
            const ptrdiff_t offset = ptrdiff_t(i) * step;
            sum += uint32_t(g.weights[i]) * (uint32_t(c[x - offset]) + c[x + offset]);
        }
        const uint32_t v = (inverted ? g.full - sum : sum) / g.sum;
        out[x] = uint8_t(v < 255 ? v : 255);
    }
}
void ShadeRow(const uint8_t* values, int n, const uint32_t* table, uint32_t* out) {
    for (int x = 0; x < n; ++x) out[x] = table[values[x]];
}
void BlurRows2(const uint8_t* c, ptrdiff_t step, int n, const GxGaussian& g, bool inverted, uint8_t* out0,
               uint8_t* out1) {
    BlurRow(c, step, n, g, inverted, out0);
    BlurRow(c + step, step, n, g, inverted, out1);
}
void SpreadRows2(const uint8_t* above, const uint8_t* row, const uint8_t* next, const uint8_t* below, int width,
                 uint8_t* out0, uint8_t* out1) {
    SpreadRow(above, row, next, width, out0);
    SpreadRow(row, next, below, width, out1);
}
void SpreadRow(const uint8_t* above, const uint8_t* row, const uint8_t* below, int width, uint8_t* out) {
    for (int x = 1; x + 1 < width; ++x) {
        unsigned s = 0;
        for (int k = -1; k <= 1; ++k) s += unsigned(above[x + k]) + row[x + k] + below[x + k];
        s >>= 2;
        out[x] = uint8_t(s > 255 ? 255 : s);
    }
}
}  // namespace Reference

const Table& ReferenceTable() {
    static const Table table = {Reference::BlurRow, Reference::SpreadRow, Reference::ShadeRow, Reference::BlurRows2,
                                Reference::SpreadRows2};
    return table;
}

#include "effect/GxKernelBuilds.inc"

const Table& Active() {
    static const Table* table = KernelTargets::Choose<Table>(kBuilds);
    return *table;
}

std::vector<Variant> Variants() { return KernelTargets::All<Variant>(kBuilds); }

}  // namespace Glimmer::BlurRows
#endif  // HWY_ONCE
