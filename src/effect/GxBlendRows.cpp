// Reference row kernels of the compositor.
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

#include "effect/GxBlendRows.h"

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
        Scalar::UnpremultiplySwap,
    };
    return table;
}

const Table& Active() { return ScalarTable(); }

}  // namespace Glimmer::BlendRows
