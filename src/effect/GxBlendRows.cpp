// Row kernels of the compositor: the scalar reference, and the same
// arithmetic vectorised once with Highway for every instruction set.
//
// All of them approximate x * w / 255 by (x + 1) * w >> 8 and clamp every
// channel sum to 255 separately, after the sum, never before. The results
// are defined to the byte: the vectorised twins that may replace these rows
// must reproduce them exactly, so the formulas below are the contract, and
// their deliberate quirks are kept:
//
//  - source-over of coverage skips pixels whose scaled coverage
//    (A + 1) * m does not exceed 255, so very faint coverage leaves no trace;
//  - the destination-over family writes only where the destination is not
//    yet opaque (layers are drawn front to back, what is there stays on top);
//  - the "NSA" form uses coverage only as an on/off switch;
//  - the "SA" form (the text fill) clips what is underneath to the coverage:
//    partially covered pixels have the combined result scaled by m;
//  - the final merge masks the scaled colour with 0xFF00 before dividing by
//    the new alpha.

// Vector form: 32-bit pixels are split into four channel vectors (Highway's
// interleaved loads), widened to 16-bit lanes so that (x + 1) * w (at most
// 256 * 255) and every clamped sum (at most 510) fit, and every case of a
// kernel is computed for all lanes and chosen per lane by mask, in the
// reference's order of precedence. The one product that can pass 16 bits (the
// text fill's (sum + 1) * m, up to 511 * 255) saturates through its high half.
// The final unpremultiply divides by the new alpha through kReciprocals (see
// GxBlendRows.h), each split in 16-bit halves so the products stay in 16-bit
// lanes. Blocks that cannot change are passed over: no coverage at all,
// transparent black in the unpremultiply, or (with the text fully opaque)
// only opaque and clear pixels, which need no division; the table draw looks
// its words up only for blocks it may change. Pixels past the last whole
// vector go through the same kernel on a padded copy (the drawing rows) or to
// the reference (the picture-wide ones), and every row goes to the reference
// in the fallback build for x86-64 CPUs without SSE4 (Highway's one-lane
// "scalar" target).

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effect/GxBlendRows.cpp"
#include <hwy/foreach_target.h>  // IWYU pragma: keep
#include <hwy/highway.h>

#include "effect/GxBlendRows.h"

#include <cstring>

HWY_BEFORE_NAMESPACE();
namespace Glimmer::BlendRows::HWY_NAMESPACE {

#if HWY_TARGET == HWY_SCALAR

const Table* GetTable() { return &ScalarTable(); }

#else

namespace hn = hwy::HWY_NAMESPACE;
using D16 = hn::ScalableTag<uint16_t>;
using D8 = hn::Rebind<uint8_t, D16>;
using V = hn::Vec<D16>;

// The reference's (v + 1) * w >> 8.
HWY_INLINE V Scale(V v, V w) { return hn::ShiftRight<8>(hn::Mul(hn::Add(v, hn::Set(D16(), 1)), w)); }
HWY_INLINE V Min255(V v) { return hn::Min(v, hn::Set(D16(), 255)); }
// product >> 8, 255 when the product reaches 2^16.
HWY_INLINE V Shift8Saturated(V a, V b) {
    const D16 d;
    const V high = hn::MulHigh(a, b);
    return hn::IfThenElse(hn::Eq(high, hn::Zero(d)), hn::ShiftRight<8>(hn::Mul(a, b)), hn::Set(d, 255));
}
HWY_INLINE V Const(uint32_t v) { return hn::Set(D16(), uint16_t(v)); }

struct Px {
    V r, g, b, a;
};
// Bytes R, G, B, A.
HWY_INLINE Px LoadPx(const uint8_t* p) {
    const D8 d8;
    const D16 d16;
    hn::Vec<D8> r, g, b, a;
    hn::LoadInterleaved4(d8, p, r, g, b, a);
    return {hn::PromoteTo(d16, r), hn::PromoteTo(d16, g), hn::PromoteTo(d16, b), hn::PromoteTo(d16, a)};
}
// Little-endian words 0xAARRGGBB: bytes B, G, R, A.
HWY_INLINE Px LoadWords(const uint32_t* w) {
    const D8 d8;
    const D16 d16;
    hn::Vec<D8> r, g, b, a;
    hn::LoadInterleaved4(d8, reinterpret_cast<const uint8_t*>(w), b, g, r, a);
    return {hn::PromoteTo(d16, r), hn::PromoteTo(d16, g), hn::PromoteTo(d16, b), hn::PromoteTo(d16, a)};
}
HWY_INLINE hn::Vec<D8> Narrow(V v) { return hn::DemoteTo(D8(), hn::BitCast(hn::Rebind<int16_t, D16>(), v)); }
HWY_INLINE void StorePx(const Px& p, uint8_t* to) {
    hn::StoreInterleaved4(Narrow(p.r), Narrow(p.g), Narrow(p.b), Narrow(p.a), D8(), to);
}
HWY_INLINE V Coverage(const uint8_t* c) { return hn::PromoteTo(D16(), hn::LoadU(D8(), c)); }
HWY_INLINE Px Select(hn::Mask<D16> m, const Px& yes, const Px& no) {
    return {hn::IfThenElse(m, yes.r, no.r), hn::IfThenElse(m, yes.g, no.g), hn::IfThenElse(m, yes.b, no.b),
            hn::IfThenElse(m, yes.a, no.a)};
}
HWY_INLINE Px ColourOf(uint32_t c) { return {Const((c >> 16) & 0xFF), Const((c >> 8) & 0xFF), Const(c & 0xFF), Const(c >> 24)}; }

// No coverage in the whole block: every coverage kernel but the copy leaves
// such pixels as they are, so the block is not touched at all.
HWY_INLINE bool NoCoverage(V m) { return hn::AllTrue(D16(), hn::Eq(m, hn::Zero(D16()))); }

// Runs `block` over whole vectors of pixels and the reference over the rest;
// returns the pixel index where the rest starts.
template <typename Block>
HWY_INLINE int Blocks(int n, Block block) {
    const int N = int(hn::Lanes(D16()));
    int i = 0;
    for (; i + N <= n; i += N) block(i);
    return i;
}

// Pixels past the last whole vector: the kernel itself on one vector of
// copies. Lanes past the row are padding whose results are dropped, and
// every lane's result depends on that lane's inputs alone, so the row's
// last pixels come out as the reference makes them.
template <typename Kernel, typename Input, typename... Rest>
HWY_INLINE void Tail(Kernel kernel, uint8_t* d, const Input* in, int n, int done, Rest... rest) {
    const int k = n - done;
    if (k <= 0) return;
    constexpr int kMax = HWY_MAX_BYTES / 2;  // lanes of D16
    uint8_t pixels[4 * kMax] = {};
    Input inputs[kMax] = {};
    std::memcpy(pixels, d + 4 * size_t(done), 4 * size_t(k));
    std::memcpy(inputs, in + done, sizeof(Input) * size_t(k));
    kernel(pixels, inputs, int(hn::Lanes(D16())), rest...);
    std::memcpy(d + 4 * size_t(done), pixels, 4 * size_t(k));
}

void SrcOver8To32(uint8_t* d, const uint8_t* cov, int n, uint32_t color) {
    const Px c = ColourOf(color);
    const V a1 = Const((color >> 24) + 1);
    const int done = Blocks(n, [&](int i) {
        const V m = Coverage(cov + i);
        if (NoCoverage(m)) return;
        uint8_t* p = d + 4 * size_t(i);
        const Px D = LoadPx(p);
        const V s = hn::Mul(a1, m);
        const V a = hn::ShiftRight<8>(s);
        const V k = hn::Sub(Const(255), a);
        // a = 255 needs no case of its own: k = 0 and Scale(c, 255) = c.
        const Px over = {Min255(hn::Add(Scale(D.r, k), Scale(c.r, m))), Min255(hn::Add(Scale(D.g, k), Scale(c.g, m))),
                         Min255(hn::Add(Scale(D.b, k), Scale(c.b, m))), Min255(hn::Add(a, Scale(D.a, k)))};
        StorePx(Select(hn::Lt(s, Const(256)), D, over), p);
    });
    Tail(SrcOver8To32, d, cov, n, done, color);
}

void DstOver8To32(uint8_t* d, const uint8_t* cov, int n, uint32_t color) {
    const Px c = ColourOf(color);
    // Blocks over an all opaque destination stay as they are; full coverage
    // over an all transparent one is the colour at coverage 255, one word.
    const hn::ScalableTag<uint32_t> dw;
    const size_t words = hn::Lanes(dw);  // half a block
    auto atFull = [&](uint32_t v) { return ((v + 1) * 255) >> 8; };
    const auto solid = hn::Set(dw, atFull(color >> 24) << 24 | atFull(color & 0xFF) << 16 |
                                       atFull((color >> 8) & 0xFF) << 8 | atFull((color >> 16) & 0xFF));
    const int done = Blocks(n, [&](int i) {
        const V m = Coverage(cov + i);
        if (NoCoverage(m)) return;
        uint8_t* p = d + 4 * size_t(i);
        auto* w = reinterpret_cast<uint32_t*>(p);
        const auto a0 = hn::ShiftRight<24>(hn::LoadU(dw, w)), a1 = hn::ShiftRight<24>(hn::LoadU(dw, w + words));
        if (hn::AllTrue(dw, hn::Eq(hn::And(a0, a1), hn::Set(dw, 255u)))) return;
        if (hn::AllTrue(dw, hn::Eq(hn::Or(a0, a1), hn::Zero(dw))) && hn::AllTrue(D16(), hn::Eq(m, Const(255)))) {
            hn::StoreU(solid, dw, w);
            hn::StoreU(solid, dw, w + words);
            return;
        }
        const Px D = LoadPx(p);
        const Px S = {Scale(c.r, m), Scale(c.g, m), Scale(c.b, m), Scale(c.a, m)};
        const V k = hn::Sub(Const(255), D.a);
        const Px under = {Min255(hn::Add(D.r, Scale(S.r, k))), Min255(hn::Add(D.g, Scale(S.g, k))),
                          Min255(hn::Add(D.b, Scale(S.b, k))), Min255(hn::Add(D.a, Scale(S.a, k)))};
        const auto keep = hn::Or(hn::Eq(D.a, Const(255)), hn::Eq(m, Const(0)));
        StorePx(Select(keep, D, Select(hn::Eq(D.a, Const(0)), S, under)), p);
    });
    Tail(DstOver8To32, d, cov, n, done, color);
}

void DstOver8To32NSA(uint8_t* d, const uint8_t* cov, int n, uint32_t color) {
    const Px c = ColourOf(color);
    const int done = Blocks(n, [&](int i) {
        const V m = Coverage(cov + i);
        if (NoCoverage(m)) return;
        uint8_t* p = d + 4 * size_t(i);
        const Px D = LoadPx(p);
        const V k = hn::Sub(Const(255), D.a);
        const Px under = {Min255(hn::Add(D.r, Scale(c.r, k))), Min255(hn::Add(D.g, Scale(c.g, k))),
                          Min255(hn::Add(D.b, Scale(c.b, k))), Min255(hn::Add(D.a, Scale(c.a, k)))};
        const auto keep = hn::Or(hn::Eq(D.a, Const(255)), hn::Eq(m, Const(0)));
        StorePx(Select(keep, D, Select(hn::Eq(D.a, Const(0)), c, under)), p);
    });
    Tail(DstOver8To32NSA, d, cov, n, done, color);
}

void DstOverSA8To32(uint8_t* d, const uint8_t* cov, int n, uint32_t color) {
    const Px c = ColourOf(color);
    const Px c1 = {Const(((color >> 16) & 0xFF) + 1), Const(((color >> 8) & 0xFF) + 1), Const((color & 0xFF) + 1),
                   Const((color >> 24) + 1)};
    const V one = Const(1);
    // Full coverage over a transparent destination: the colour at coverage
    // 255, the same word for the whole block.
    const hn::ScalableTag<uint32_t> dw;
    const size_t words = hn::Lanes(dw);  // half a block
    auto atFull = [&](uint32_t v) { return ((v + 1) * 255) >> 8; };
    const auto solid = hn::Set(dw, atFull(color >> 24) << 24 | atFull(color & 0xFF) << 16 |
                                       atFull((color >> 8) & 0xFF) << 8 | atFull((color >> 16) & 0xFF));
    const int done = Blocks(n, [&](int i) {
        const V m = Coverage(cov + i);
        if (NoCoverage(m)) return;
        uint8_t* p = d + 4 * size_t(i);
        if (hn::AllTrue(D16(), hn::Eq(m, Const(255)))) {
            auto* w = reinterpret_cast<uint32_t*>(p);
            const auto a = hn::Or(hn::ShiftRight<24>(hn::LoadU(dw, w)), hn::ShiftRight<24>(hn::LoadU(dw, w + words)));
            if (hn::AllTrue(dw, hn::Eq(a, hn::Zero(dw)))) {
                hn::StoreU(solid, dw, w);
                hn::StoreU(solid, dw, w + words);
                return;
            }
        }
        const Px D = LoadPx(p);
        // (v + 1) * m stays below 2^16 for bytes: no saturation needed here.
        const Px S = {hn::ShiftRight<8>(hn::Mul(c1.r, m)), hn::ShiftRight<8>(hn::Mul(c1.g, m)),
                      hn::ShiftRight<8>(hn::Mul(c1.b, m)), hn::ShiftRight<8>(hn::Mul(c1.a, m))};
        const V k = hn::Sub(Const(255), D.a);
        const Px full = {Min255(hn::Add(D.r, Scale(c.r, k))), Min255(hn::Add(D.g, Scale(c.g, k))),
                         Min255(hn::Add(D.b, Scale(c.b, k))), Min255(hn::Add(D.a, Scale(S.a, k)))};
        const Px opaque = {hn::ShiftRight<8>(hn::Mul(hn::Add(D.r, one), m)),
                           hn::ShiftRight<8>(hn::Mul(hn::Add(D.g, one), m)),
                           hn::ShiftRight<8>(hn::Mul(hn::Add(D.b, one), m)), m};
        auto clipped = [&](V dv, V sv) { return Shift8Saturated(hn::Add(hn::Add(dv, Scale(sv, k)), one), m); };
        const Px general = {clipped(D.r, S.r), clipped(D.g, S.g), clipped(D.b, S.b), clipped(D.a, S.a)};
        Px out = Select(hn::Eq(D.a, Const(255)), opaque, general);
        out = Select(hn::Eq(m, Const(255)), full, out);
        out = Select(hn::Eq(D.a, Const(0)), S, out);
        StorePx(Select(hn::Eq(m, Const(0)), D, out), p);
    });
    Tail(DstOverSA8To32, d, cov, n, done, color);
}

void Copy8To32(uint8_t* d, const uint8_t* cov, int n, uint32_t color) {
    const Px c = ColourOf(color);
    const int done = Blocks(n, [&](int i) {
        StorePx(Px{c.r, c.g, c.b, Scale(c.a, Coverage(cov + i))}, d + 4 * size_t(i));
    });
    Tail(Copy8To32, d, cov, n, done, color);
}

void Max8To8(uint8_t* d, const uint8_t* cov, int n) {
    const hn::ScalableTag<uint8_t> d8;
    const int N = int(hn::Lanes(d8));
    int i = 0;
    for (; i + N <= n; i += N) hn::StoreU(hn::Max(hn::LoadU(d8, d + i), hn::LoadU(d8, cov + i)), d8, d + i);
    Scalar::Max8To8(d + i, cov + i, n - i);
}

void SrcOver32To32(uint8_t* d, const uint32_t* src, int n) {
    const int done = Blocks(n, [&](int i) {
        uint8_t* p = d + 4 * size_t(i);
        const Px D = LoadPx(p);
        const Px S = LoadWords(src + i);
        // An opaque source needs no case of its own: k = 0 leaves the source.
        const V k = hn::Sub(Const(255), S.a);
        StorePx(Px{Min255(hn::Add(S.r, Scale(D.r, k))), Min255(hn::Add(S.g, Scale(D.g, k))),
                   Min255(hn::Add(S.b, Scale(D.b, k))), Min255(hn::Add(S.a, Scale(D.a, k)))},
                p);
    });
    Tail(SrcOver32To32, d, src, n, done);
}

HWY_INLINE Px DstOverPixels(const Px& D, const Px& S, bool copyOverClear) {
    const V k = hn::Sub(Const(255), D.a);
    Px out = {Min255(hn::Add(D.r, Scale(S.r, k))), Min255(hn::Add(D.g, Scale(S.g, k))),
              Min255(hn::Add(D.b, Scale(S.b, k))), Min255(hn::Add(D.a, Scale(S.a, k)))};
    if (copyOverClear) out = Select(hn::Eq(D.a, Const(0)), S, out);
    return Select(hn::Or(hn::Eq(D.a, Const(255)), hn::Eq(S.a, Const(0))), D, out);
}

void DstOver32To32(uint8_t* d, const uint32_t* src, int n) {
    // Blocks whose destination is all opaque stay as they are; over an all
    // transparent one each source word is copied (red and blue trade places
    // between 0xAARRGGBB words and R, G, B, A bytes), but where its alpha is
    // 0 too, which leaves the destination alone.
    const hn::ScalableTag<uint32_t> dw;
    const size_t words = hn::Lanes(dw);  // half a block
    const auto full = hn::Set(dw, 255u), zero = hn::Zero(dw);
    auto swapped = [&](hn::Vec<decltype(dw)> v) {
        return hn::Or(hn::And(v, hn::Set(dw, 0xFF00FF00u)),
                      hn::Or(hn::ShiftLeft<16>(hn::And(v, hn::Set(dw, 0xFFu))),
                             hn::And(hn::ShiftRight<16>(v), hn::Set(dw, 0xFFu))));
    };
    const int done = Blocks(n, [&](int i) {
        uint8_t* p = d + 4 * size_t(i);
        auto* w = reinterpret_cast<uint32_t*>(p);
        const auto d0 = hn::LoadU(dw, w), d1 = hn::LoadU(dw, w + words);
        const auto a0 = hn::ShiftRight<24>(d0), a1 = hn::ShiftRight<24>(d1);
        if (hn::AllTrue(dw, hn::Eq(hn::And(a0, a1), full))) return;
        if (hn::AllTrue(dw, hn::Eq(hn::Or(a0, a1), zero))) {
            const auto s0 = hn::LoadU(dw, src + i), s1 = hn::LoadU(dw, src + i + words);
            hn::StoreU(hn::IfThenElse(hn::Eq(hn::ShiftRight<24>(s0), zero), d0, swapped(s0)), dw, w);
            hn::StoreU(hn::IfThenElse(hn::Eq(hn::ShiftRight<24>(s1), zero), d1, swapped(s1)), dw, w + words);
            return;
        }
        StorePx(DstOverPixels(LoadPx(p), LoadWords(src + i), true), p);
    });
    Tail(DstOver32To32, d, src, n, done);
}

void DstOverTable32(uint8_t* d, const uint8_t* values, int n, const uint32_t* table) {
    // As DstOver32To32, the words looked up only for blocks that need them:
    // not over an all opaque destination, nor where every value picks a
    // table[0] of 0 (a transparent word leaves any destination alone).
    const hn::ScalableTag<uint32_t> dw;
    const hn::Rebind<int32_t, decltype(dw)> di;
    const hn::Rebind<uint8_t, decltype(dw)> d8w;
    const size_t words = hn::Lanes(dw);  // half a block
    const auto full = hn::Set(dw, 255u), zero = hn::Zero(dw);
    const auto* entries = reinterpret_cast<const int32_t*>(table);
    const bool clearZero = table[0] == 0;
    auto lookUp = [&](const uint8_t* at) {
        return hn::BitCast(dw, hn::GatherIndex(di, entries, hn::BitCast(di, hn::PromoteTo(dw, hn::LoadU(d8w, at)))));
    };
    auto swapped = [&](hn::Vec<decltype(dw)> v) {
        return hn::Or(hn::And(v, hn::Set(dw, 0xFF00FF00u)),
                      hn::Or(hn::ShiftLeft<16>(hn::And(v, hn::Set(dw, 0xFFu))),
                             hn::And(hn::ShiftRight<16>(v), hn::Set(dw, 0xFFu))));
    };
    const int done = Blocks(n, [&](int i) {
        if (clearZero && hn::AllTrue(D16(), hn::Eq(Coverage(values + i), hn::Zero(D16())))) return;
        uint8_t* p = d + 4 * size_t(i);
        auto* w = reinterpret_cast<uint32_t*>(p);
        const auto d0 = hn::LoadU(dw, w), d1 = hn::LoadU(dw, w + words);
        const auto a0 = hn::ShiftRight<24>(d0), a1 = hn::ShiftRight<24>(d1);
        if (hn::AllTrue(dw, hn::Eq(hn::And(a0, a1), full))) return;
        const auto s0 = lookUp(values + i), s1 = lookUp(values + i + words);
        if (hn::AllTrue(dw, hn::Eq(hn::Or(a0, a1), zero))) {
            hn::StoreU(hn::IfThenElse(hn::Eq(hn::ShiftRight<24>(s0), zero), d0, swapped(s0)), dw, w);
            hn::StoreU(hn::IfThenElse(hn::Eq(hn::ShiftRight<24>(s1), zero), d1, swapped(s1)), dw, w + words);
            return;
        }
        HWY_ALIGN uint32_t looked[HWY_MAX_BYTES / 2];
        hn::Store(s0, dw, looked);
        hn::Store(s1, dw, looked + words);
        StorePx(DstOverPixels(LoadPx(p), LoadWords(looked), true), p);
    });
    Tail(DstOverTable32, d, values, n, done, table);
}

void DstOver32To32Bytes(uint8_t* d, const uint8_t* src, int n, int flag) {
    const int done = Blocks(n, [&](int i) {
        uint8_t* p = d + 4 * size_t(i);
        StorePx(DstOverPixels(LoadPx(p), LoadPx(src + 4 * size_t(i)), flag != 0), p);
    });
    Scalar::DstOver32To32Bytes(d + 4 * size_t(done), src + 4 * size_t(done), n - done, flag);
}

void SwapRedBlue(uint8_t* p, int n) {
    const hn::ScalableTag<uint8_t> d8;
    const int N = int(hn::Lanes(d8));
    int i = 0;
    for (; i + N <= n; i += N) {
        hn::Vec<decltype(d8)> r, g, b, a;
        hn::LoadInterleaved4(d8, p + 4 * size_t(i), r, g, b, a);
        hn::StoreInterleaved4(b, g, r, a, d8, p + 4 * size_t(i));
    }
    Scalar::SwapRedBlue(p + 4 * size_t(i), n - i);
}

void MergeWork(uint8_t* d, const uint8_t* work, const uint8_t* cov, int n) {
    const int done = Blocks(n, [&](int i) {
        uint8_t* p = d + 4 * size_t(i);
        const Px D = LoadPx(p);
        const Px W = LoadPx(work + 4 * size_t(i));
        const V m = Coverage(cov + i);
        const V im = hn::Sub(Const(255), m);
        StorePx(Px{Min255(hn::Add(Scale(W.r, im), Scale(D.r, m))), Min255(hn::Add(Scale(W.g, im), Scale(D.g, m))),
                   Min255(hn::Add(Scale(W.b, im), Scale(D.b, m))), Min255(hn::Add(Scale(W.a, im), Scale(D.a, m)))},
                p);
    });
    Scalar::MergeWork(d + 4 * size_t(done), work + 4 * size_t(done), cov + done, n - done);
}

// min(255, 256 q / a) for q, a < 256 as min(255, q * kReciprocals[a] >> 16),
// in 32-bit lanes, half a vector at a time; a = 0 gives 0.
template <bool kSwap>
void UnpremultiplyRows(uint8_t* d, int n, uint32_t alpha) {
    const hn::Half<D16> dh;
    const hn::Rebind<uint32_t, decltype(dh)> d32;
    const hn::Rebind<int32_t, decltype(dh)> di32;
    const V t = Const(alpha & 0xFF);
    const hn::ScalableTag<uint32_t> dw;
    const size_t words = hn::Lanes(dw);  // half a block
    const bool plain = (alpha & 0xFF) == 255;
    // With t = 255 an opaque pixel stays as it is (q = v, and 256 v / 255
    // rounds down to v, 255 clamped from 256) and a transparent one becomes 0:
    // a block of only those needs no division. Returns false for other blocks.
    auto opaqueOrClear = [&](uint8_t* p) {
        auto* w = reinterpret_cast<uint32_t*>(p);
        const auto w0 = hn::LoadU(dw, w), w1 = hn::LoadU(dw, w + words);
        const auto a0 = hn::ShiftRight<24>(w0), a1 = hn::ShiftRight<24>(w1);
        const auto zero = hn::Zero(dw), full = hn::Set(dw, 255u);
        if (!hn::AllTrue(dw, hn::Or(hn::Eq(a0, zero), hn::Eq(a0, full))) ||
            !hn::AllTrue(dw, hn::Or(hn::Eq(a1, zero), hn::Eq(a1, full))))
            return false;
        auto finish = [&](hn::Vec<decltype(dw)> v) {
            if (kSwap) {
                const auto keep = hn::And(v, hn::Set(dw, 0xFF00FF00u));
                v = hn::Or(keep, hn::Or(hn::ShiftLeft<16>(hn::And(v, hn::Set(dw, 0xFFu))),
                                        hn::And(hn::ShiftRight<16>(v), hn::Set(dw, 0xFFu))));
            }
            return v;
        };
        hn::StoreU(hn::IfThenZeroElse(hn::Eq(a0, zero), finish(w0)), dw, w);
        hn::StoreU(hn::IfThenZeroElse(hn::Eq(a1, zero), finish(w1)), dw, w + words);
        return true;
    };
    // A block of transparent black stays as it is whatever the alpha (its
    // new alpha is 0, and so is its colour): nothing to write.
    auto clear = [&](const uint8_t* p) {
        const auto* w = reinterpret_cast<const uint32_t*>(p);
        return hn::AllTrue(dw, hn::Eq(hn::Or(hn::LoadU(dw, w), hn::LoadU(dw, w + words)), hn::Zero(dw)));
    };
    const int done = Blocks(n, [&](int i) {
        uint8_t* p = d + 4 * size_t(i);
        if (clear(p)) return;
        if (plain && opaqueOrClear(p)) return;
        const Px D = LoadPx(p);
        const V a = Scale(D.a, t);
        const auto lo = hn::GatherIndex(d32, kReciprocals.data(), hn::BitCast(di32, hn::PromoteTo(d32, hn::LowerHalf(dh, a))));
        const auto hi = hn::GatherIndex(d32, kReciprocals.data(), hn::BitCast(di32, hn::PromoteTo(d32, hn::UpperHalf(dh, a))));
        // The reciprocal as high * 2^16 + low (high <= 256): then
        // (q r) >> 16 = q high + ((q low) >> 16) exactly, at most
        // 255 * 256 + 254 < 2^16, all in 16-bit lanes.
        const V high = hn::Combine(D16(), hn::TruncateTo(dh, hn::ShiftRight<16>(hi)), hn::TruncateTo(dh, hn::ShiftRight<16>(lo)));
        const V low = hn::Combine(D16(), hn::TruncateTo(dh, hi), hn::TruncateTo(dh, lo));
        auto divide16 = [&](V q) { return Min255(hn::Add(hn::Mul(q, high), hn::MulHigh(q, low))); };
        // The reference's ((v + 1) * t & 0xFF00) / a is 256 q / a with q = (v + 1) * t >> 8.
        const V r = divide16(Scale(D.r, t));
        const V g = divide16(Scale(D.g, t));
        const V b = divide16(Scale(D.b, t));
        StorePx(kSwap ? Px{b, g, r, a} : Px{r, g, b, a}, p);
    });
    if (kSwap) {
        Scalar::UnpremultiplySwap(d + 4 * size_t(done), n - done, alpha);
    } else {
        Scalar::Unpremultiply(d + 4 * size_t(done), n - done, alpha);
    }
}

void Unpremultiply(uint8_t* p, int n, uint32_t alpha) { UnpremultiplyRows<false>(p, n, alpha); }
void UnpremultiplySwap(uint8_t* p, int n, uint32_t alpha) { UnpremultiplyRows<true>(p, n, alpha); }

const Table* GetTable() {
    static const Table table = {
        SrcOver8To32,  DstOver8To32,  DstOver8To32NSA,    DstOverSA8To32, Copy8To32,
        Max8To8,       SrcOver32To32, DstOver32To32,      DstOver32To32Bytes, SwapRedBlue,
        MergeWork,     Unpremultiply, UnpremultiplySwap, DstOverTable32,
    };
    return &table;
}

#endif  // HWY_TARGET == HWY_SCALAR

}  // namespace Glimmer::BlendRows::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "effect/GxKernelTargets.h"


namespace Glimmer::BlendRows {

namespace {

constexpr int kR = 0, kG = 1, kB = 2, kA = 3;

inline uint32_t Min255(uint32_t v) { return v > 255 ? 255 : v; }
// (v + 1) * w >> 8: the engine's division by 255.
inline uint32_t Scale(uint32_t v, uint32_t w) { return ((v + 1) * w) >> 8; }

struct Channels {
    uint32_t a, r, g, b;
};
inline Channels Split(uint32_t color) {
    return {color >> 24, (color >> 16) & 0xFF, (color >> 8) & 0xFF, color & 0xFF};
}

}  // namespace

namespace Scalar {

void SrcOver8To32(uint8_t* d, const uint8_t* coverage, int n, uint32_t color) {
    const Channels c = Split(color);
    for (int i = 0; i < n; ++i, d += 4) {
        const uint32_t m = coverage[i];
        const uint32_t s = (c.a + 1) * m;
        if (s <= 255) continue;
        const uint32_t a = s >> 8;
        if (a == 255) {
            d[kR] = uint8_t(c.r);
            d[kG] = uint8_t(c.g);
            d[kB] = uint8_t(c.b);
            d[kA] = 255;
            continue;
        }
        const uint32_t k = 255 - a;
        d[kA] = uint8_t(Min255(a + Scale(d[kA], k)));
        d[kR] = uint8_t(Min255(Scale(d[kR], k) + Scale(c.r, m)));
        d[kG] = uint8_t(Min255(Scale(d[kG], k) + Scale(c.g, m)));
        d[kB] = uint8_t(Min255(Scale(d[kB], k) + Scale(c.b, m)));
    }
}

void DstOver8To32(uint8_t* d, const uint8_t* coverage, int n, uint32_t color) {
    const Channels c = Split(color);
    for (int i = 0; i < n; ++i, d += 4) {
        const uint32_t m = coverage[i];
        const uint32_t da = d[kA];
        if (da == 255 || m == 0) continue;
        const uint32_t sa = Scale(c.a, m), sr = Scale(c.r, m), sg = Scale(c.g, m), sb = Scale(c.b, m);
        if (da == 0) {
            d[kR] = uint8_t(sr);
            d[kG] = uint8_t(sg);
            d[kB] = uint8_t(sb);
            d[kA] = uint8_t(sa);
            continue;
        }
        const uint32_t k = 255 - da;
        d[kR] = uint8_t(Min255(d[kR] + Scale(sr, k)));
        d[kG] = uint8_t(Min255(d[kG] + Scale(sg, k)));
        d[kB] = uint8_t(Min255(d[kB] + Scale(sb, k)));
        d[kA] = uint8_t(Min255(da + Scale(sa, k)));
    }
}

void DstOver8To32NSA(uint8_t* d, const uint8_t* coverage, int n, uint32_t color) {
    const Channels c = Split(color);
    for (int i = 0; i < n; ++i, d += 4) {
        const uint32_t da = d[kA];
        if (da == 255 || coverage[i] == 0) continue;
        if (da == 0) {
            d[kR] = uint8_t(c.r);
            d[kG] = uint8_t(c.g);
            d[kB] = uint8_t(c.b);
            d[kA] = uint8_t(c.a);
            continue;
        }
        const uint32_t k = 255 - da;
        d[kA] = uint8_t(Min255(da + Scale(c.a, k)));
        d[kR] = uint8_t(Min255(d[kR] + Scale(c.r, k)));
        d[kG] = uint8_t(Min255(d[kG] + Scale(c.g, k)));
        d[kB] = uint8_t(Min255(d[kB] + Scale(c.b, k)));
    }
}

void DstOverSA8To32(uint8_t* d, const uint8_t* coverage, int n, uint32_t color) {
    const Channels c = Split(color);
    // A product of 16 bits or more saturates to 255. With byte inputs only
    // the last case below can get there; the test is kept everywhere so the
    // rule reads the same in each case.
    auto shift8 = [](uint32_t product) { return product >= 65536 ? 255u : product >> 8; };
    for (int i = 0; i < n; ++i, d += 4) {
        const uint32_t m = coverage[i];
        if (m == 0) continue;
        const uint32_t da = d[kA];
        const uint32_t sa = shift8((c.a + 1) * m);
        const uint32_t sr = shift8((c.r + 1) * m), sg = shift8((c.g + 1) * m),
                       sb = shift8((c.b + 1) * m);
        if (da == 0) {
            d[kR] = uint8_t(sr);
            d[kG] = uint8_t(sg);
            d[kB] = uint8_t(sb);
            d[kA] = uint8_t(sa);
        } else if (m == 255) {
            // Full coverage: plain destination-over with the unscaled colour.
            const uint32_t k = 255 - da;
            d[kR] = uint8_t(Min255(d[kR] + Scale(c.r, k)));
            d[kG] = uint8_t(Min255(d[kG] + Scale(c.g, k)));
            d[kB] = uint8_t(Min255(d[kB] + Scale(c.b, k)));
            d[kA] = uint8_t(Min255(da + Scale(sa & 255, k)));
        } else if (da == 255) {
            d[kA] = uint8_t(m);
            d[kR] = uint8_t(shift8((d[kR] + 1u) * m));
            d[kG] = uint8_t(shift8((d[kG] + 1u) * m));
            d[kB] = uint8_t(shift8((d[kB] + 1u) * m));
        } else {
            const uint32_t k = 255 - da;
            d[kA] = uint8_t(shift8((da + Scale(sa, k) + 1) * m));
            d[kR] = uint8_t(shift8((d[kR] + Scale(sr, k) + 1) * m));
            d[kG] = uint8_t(shift8((d[kG] + Scale(sg, k) + 1) * m));
            d[kB] = uint8_t(shift8((d[kB] + Scale(sb, k) + 1) * m));
        }
    }
}

void Copy8To32(uint8_t* d, const uint8_t* coverage, int n, uint32_t color) {
    const Channels c = Split(color);
    for (int i = 0; i < n; ++i, d += 4) {
        // The colour channels are deliberately not scaled by the coverage.
        d[kR] = uint8_t(c.r);
        d[kG] = uint8_t(c.g);
        d[kB] = uint8_t(c.b);
        d[kA] = uint8_t(Scale(c.a, coverage[i]));
    }
}

void Max8To8(uint8_t* d, const uint8_t* coverage, int n) {
    for (int i = 0; i < n; ++i)
        if (coverage[i] > d[i]) d[i] = coverage[i];
}

void SrcOver32To32(uint8_t* d, const uint32_t* src, int n) {
    for (int i = 0; i < n; ++i, d += 4) {
        const Channels s = Split(src[i]);
        if (s.a == 255) {
            d[kR] = uint8_t(s.r);
            d[kG] = uint8_t(s.g);
            d[kB] = uint8_t(s.b);
            d[kA] = 255;
            continue;
        }
        // Alpha 0 needs no case of its own: k = 255 keeps every byte and a
        // premultiplied source adds nothing.
        const uint32_t k = 255 - s.a;
        d[kA] = uint8_t(Min255(s.a + Scale(d[kA], k)));
        d[kR] = uint8_t(Min255(s.r + Scale(d[kR], k)));
        d[kG] = uint8_t(Min255(s.g + Scale(d[kG], k)));
        d[kB] = uint8_t(Min255(s.b + Scale(d[kB], k)));
    }
}

namespace {
// Destination-over of one premultiplied source pixel; `copyOverClear`
// lets a fully transparent destination take the source as it is.
inline void DstOverPixel(uint8_t* d, Channels s, bool copyOverClear) {
    const uint32_t da = d[kA];
    if (da == 255 || s.a == 0) return;
    if (da == 0 && copyOverClear) {
        d[kR] = uint8_t(s.r);
        d[kG] = uint8_t(s.g);
        d[kB] = uint8_t(s.b);
        d[kA] = uint8_t(s.a);
        return;
    }
    const uint32_t k = 255 - da;
    d[kA] = uint8_t(Min255(da + Scale(s.a, k)));
    d[kR] = uint8_t(Min255(d[kR] + Scale(s.r, k)));
    d[kG] = uint8_t(Min255(d[kG] + Scale(s.g, k)));
    d[kB] = uint8_t(Min255(d[kB] + Scale(s.b, k)));
}
}  // namespace

void DstOver32To32(uint8_t* d, const uint32_t* src, int n) {
    for (int i = 0; i < n; ++i, d += 4) DstOverPixel(d, Split(src[i]), true);
}

void DstOverTable32(uint8_t* d, const uint8_t* values, int n, const uint32_t* table) {
    for (int i = 0; i < n; ++i, d += 4) DstOverPixel(d, Split(table[values[i]]), true);
}

void DstOver32To32Bytes(uint8_t* d, const uint8_t* src, int n, int flag) {
    for (int i = 0; i < n; ++i, d += 4, src += 4)
        DstOverPixel(d, Channels{src[kA], src[kR], src[kG], src[kB]}, flag != 0);
}

void SwapRedBlue(uint8_t* p, int n) {
    // As a little-endian word: (w & 0xFF00FF00) | (w & 0xFF) << 16 | (w >> 16) & 0xFF.
    for (int i = 0; i < n; ++i, p += 4) {
        const uint8_t t = p[0];
        p[0] = p[2];
        p[2] = t;
    }
}

void MergeWork(uint8_t* d, const uint8_t* work, const uint8_t* coverage, int n) {
    for (int i = 0; i < n; ++i, d += 4, work += 4) {
        const uint32_t m = coverage[i];
        for (int c = 0; c < 4; ++c) d[c] = uint8_t(Min255(Scale(work[c], 255 - m) + Scale(d[c], m)));
    }
}

void Unpremultiply(uint8_t* p, int n, uint32_t alpha) {
    const uint32_t t = alpha & 0xFF;
    for (int i = 0; i < n; ++i, p += 4) {
        const uint32_t a = Scale(p[kA], t);
        if (a == 0) {
            p[kR] = p[kG] = p[kB] = 0;
        } else {
            // The mask with 0xFF00 before the division is deliberate.
            for (int c = 0; c < 3; ++c) p[c] = uint8_t(Min255(((p[c] + 1u) * t & 0xFF00u) / a));
        }
        p[kA] = uint8_t(a);
    }
}

void UnpremultiplySwap(uint8_t* p, int n, uint32_t alpha) {
    Unpremultiply(p, n, alpha);
    SwapRedBlue(p, n);
}

}  // namespace Scalar

const Table& ScalarTable() {
    static const Table table = {
        Scalar::SrcOver8To32,  Scalar::DstOver8To32,       Scalar::DstOver8To32NSA,
        Scalar::DstOverSA8To32, Scalar::Copy8To32,         Scalar::Max8To8,
        Scalar::SrcOver32To32, Scalar::DstOver32To32,      Scalar::DstOver32To32Bytes,
        Scalar::SwapRedBlue,   Scalar::MergeWork,          Scalar::Unpremultiply,
        Scalar::UnpremultiplySwap, Scalar::DstOverTable32,
    };
    return table;
}

#include "effect/GxKernelBuilds.inc"

const Table& Active() {
    static const Table* table = KernelTargets::Choose<Table>(kBuilds);
    return *table;
}

std::vector<Variant> Variants() { return KernelTargets::All<Variant>(kBuilds); }

}  // namespace Glimmer::BlendRows
#endif  // HWY_ONCE
