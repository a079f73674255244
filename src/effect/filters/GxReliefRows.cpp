// The relief row kernels, once per instruction set (see GxReliefRows.h).
//
// Lighting: every lane takes the scalar path of GxRelief.h's helpers
// (ReliefSlopeIncidence, ReliefClampLevel, ReliefEdgeFactor,
// ReliefPlaneValue) in vector form: the float steps in the same order, the
// quotient towards / length as a vector division (correctly rounded like the
// scalar one), fsqrt's bit trick on the integer view of the lanes, the
// truncations as truncating conversions of values already clamped to
// 0..256, the plane bytes in 32-bit lanes. A pixel the scalar loop skips
// keeps its byte: it is loaded and selected back.
//
// Colouring: the tones as float products truncated to ints, the tint's three
// channels in 32-bit lanes, the winner's colour chosen by mask.
//
// The searches: the sweep is one compare-and-select per column of the
// source's disc (a span shorter than a vector takes a narrower one, and the
// last vector may overlap the one before it: taking a minimum twice changes
// nothing), the inward row one subtraction and compare-and-select per
// window offset, on whole vectors of columns at once. Columns past the last
// whole vector take the scalar form, as does everything in the one-lane
// fallback build.

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "effect/filters/GxReliefRows.cpp"
#include <hwy/foreach_target.h>  // IWYU pragma: keep
#include <hwy/highway.h>

#include "effect/filters/GxRelief.h"
#include "effect/filters/GxReliefRows.h"
#include "effect/filters/GxSqrt.h"

// ---- the scalar pixels, shared by the reference and the vector kernels' tails

#ifndef GLIMMER_RELIEF_ROWS_SCALAR
#define GLIMMER_RELIEF_ROWS_SCALAR
namespace Glimmer::ReliefRows::Scalar {

inline GxReliefLight Vector(const Light& l) { return GxReliefLight{l.x, l.y, l.z}; }

inline void BevelPixel(const float* d, ptrdiff_t stride, const Light& l, uint8_t* second, uint8_t* first) {
    if (*d == l.range) return;  // flat top or flat ground
    const float level = ReliefClampLevel(ReliefSlopeIncidence(Vector(l), l.normalZ, d, stride, 0.5f) * 255.0f);
    const float v = l.inside ? level : float(255 - int(level));
    const int edge = ReliefEdgeFactor(l.range - *d);
    *second = ReliefPlaneValue(l.secondAlpha * int(v + 1.0f), edge);
    *first = ReliefPlaneValue((256 - int(v)) * l.firstAlpha, edge);
}

inline void EmbossHardPixel(const float* f, ptrdiff_t stride, const Light& l, uint8_t* second, uint8_t* first) {
    if (*f == l.range) return;
    const float incidence = ReliefSlopeIncidence(Vector(l), l.normalZ, f, stride, 0.5f);
    const int n = int(ReliefClampLevel(incidence * 255.0f));
    // Outside the edge the height falls to Ro; inside, the flat floor 1 - Ri gives 0.
    const float e = *f > 0.0f ? l.range - *f : *f + l.inRange - 1.0f;
    const int edge = ReliefEdgeFactor(e);
    *second = ReliefPlaneValue((256 - n) * l.secondAlpha, edge);
    *first = ReliefPlaneValue((n + 1) * l.firstAlpha, edge);
}

inline void EmbossSoftPixel(const float* o, const float* in, ptrdiff_t stride, const Light& l, uint8_t* second,
                            uint8_t* first) {
    if (*o > 0.0f && *o < l.range) {
        const float incidence = ReliefSlopeIncidence(Vector(l), l.normalZ, o, stride, 0.5f);
        const int n = int(ReliefClampLevel(incidence * 255.0f));
        const int edge = ReliefEdgeFactor(l.range - *o);
        *second = ReliefPlaneValue((256 - n) * l.secondAlpha, edge);
        *first = ReliefPlaneValue((n + 1) * l.firstAlpha, edge);
    }
    if (*in > 0.0f && *in < l.inRange) {
        // The inward distance is a descending height: gradient negated,
        // level inverted, the washes' roles swapped.
        const float incidence = ReliefSlopeIncidence(Vector(l), l.normalZ, in, stride, -0.5f);
        const int n = int(ReliefClampLevel((1.0f - incidence) * 255.0f));
        const int edge = ReliefEdgeFactor(l.inRange - *in);
        *second = ReliefPlaneValue((n + 1) * l.secondAlpha, edge);
        *first = ReliefPlaneValue((256 - n) * l.firstAlpha, edge);
    }
}

inline void SweepSpan(float* out, const float* roots, int n, float amount) {
    for (int i = 0; i < n; ++i) {
        const float candidate = amount + roots[i];
        if (candidate < out[i]) out[i] = candidate;
    }
}

inline float InwardPixel(const float* sources, ptrdiff_t stride, int above, int below, int radius,
                         const float* roots, float cur) {
    if (!(cur < 0.0f)) return cur;
    const int side = 2 * radius + 1;
    for (int a = -above; a <= below; ++a) {
        const float* s = sources + ptrdiff_t(a) * stride;
        const float* r = roots + ptrdiff_t(a + radius) * side + radius;
        for (int dx = -radius; dx <= radius; ++dx) {
            const float candidate = s[dx] - r[dx];
            if (cur < candidate) cur = candidate;
        }
    }
    return cur;
}

inline float SourceAmount(float v, bool positive) { return positive && !(v > 0.0f) ? 0.0f : v; }

inline uint8_t SidesOf(float above, float left, float v, float right, float below, bool positive) {
    if (!(v < 1.0f)) return 0;
    const float amount = SourceAmount(v, positive);
    auto fails = [&](float n) { return n < 1.0f && SourceAmount(n, positive) <= amount ? 0 : 1; };
    return uint8_t(fails(left) | fails(right) << 1 | fails(above) << 2 | fails(below) << 3);
}

inline float NearPixel(const float* line, int radius) {
    float best = line[0];
    for (int dx = 1; dx <= radius; ++dx) {
        const float square = float(dx * dx);
        const float left = line[-dx] + square;
        const float right = line[dx] + square;
        if (left < best) best = left;
        if (right < best) best = right;
    }
    return best;
}

inline uint32_t ColourPixel(uint8_t first, uint8_t second, float gain, uint32_t firstColour,
                            uint32_t secondColour) {
    const GxReliefTone tone = ReliefTone(first, second, gain);
    const int alpha = tone.difference > 255 ? 255 : tone.difference;
    return ReliefTint(tone.first ? firstColour : secondColour, alpha);
}

// ((difference + 1) * weight) >> 8, 255 when the product reaches 65536.
inline int WeightedAlpha(int difference, int weight) {
    const int product = (difference + 1) * weight;
    return product >= 65536 ? 255 : product >> 8;
}

inline int Channel(uint32_t argb, int shift) { return int((argb >> shift) & 0xFF); }

// The two-sided pixel: the normal relief (weight m) over the mirrored one.
inline uint32_t TwoSidedPixel(uint8_t normalFirst, uint8_t normalSecond, uint8_t mirroredFirst,
                              uint8_t mirroredSecond, int m, float gain, uint32_t firstColour,
                              uint32_t secondColour) {
    const GxReliefTone normal = ReliefTone(normalFirst, normalSecond, gain);
    const GxReliefTone mirrored = ReliefTone(mirroredFirst, mirroredSecond, gain);
    const int alpha1 = WeightedAlpha(normal.difference, m);
    const int alpha2 = WeightedAlpha(mirrored.difference, 255 - m);
    const uint32_t c1 = ReliefTint(normal.first ? firstColour : secondColour, alpha1);
    const uint32_t c2 = ReliefTint(mirrored.first ? firstColour : secondColour, alpha2);
    if (alpha1 == 0) return c2;
    if (alpha1 == 255) return c1;
    const int k = 255 - alpha1;
    int alpha = alpha1 + ((k * (alpha2 + 1)) >> 8);
    uint32_t out = uint32_t(alpha > 255 ? 255 : alpha) << 24;
    for (int shift = 16; shift >= 0; shift -= 8) {
        const int v = Channel(c1, shift) + ((k * (Channel(c2, shift) + 1)) >> 8);
        out |= uint32_t(v > 255 ? 255 : v) << shift;
    }
    return out;
}

// The span of row y that the disc of a source at (x, sourceRow) covers, and
// where its roots start.
struct Span {
    int begin, end;
    const float* roots;
};
inline Span SweepSpanOf(int width, int x, int sourceRow, int y, int left, int right, const Disc& disc) {
    const int a = y > sourceRow ? y - sourceRow : sourceRow - y;
    const int chord = disc.chords[a];
    const int from = x - (left < chord ? left : chord);
    const int to = x + (right < chord ? right : chord) + 1;
    const int begin = from > 0 ? from : 0;
    const int end = to < width ? to : width;
    return {begin, end, disc.roots[a] + (begin - x)};
}

}  // namespace Glimmer::ReliefRows::Scalar
#endif

HWY_BEFORE_NAMESPACE();
namespace Glimmer::ReliefRows::HWY_NAMESPACE {
namespace hn = hwy::HWY_NAMESPACE;

#if HWY_TARGET != HWY_SCALAR
using DF = hn::ScalableTag<float>;
using DI = hn::RebindToSigned<DF>;
using D8 = hn::Rebind<uint8_t, DF>;
using VF = hn::Vec<DF>;
using VI = hn::Vec<DI>;

// fsqrt (GxSqrt.h), lane by lane.
HWY_INLINE VF FastSqrt(DF df, VF x) {
    const DI di;
    const VI i = hn::BitCast(di, x);
    const VF y = hn::BitCast(df, hn::Sub(hn::Set(di, 0x5F3759DF), hn::ShiftRight<1>(i)));
    VF t = hn::Mul(hn::Mul(x, hn::Set(df, -0.5f)), y);
    t = hn::Mul(t, y);
    t = hn::Add(t, hn::Set(df, 1.5f));
    return hn::Mul(hn::Mul(y, x), t);
}

// ReliefSlopeIncidence at the lanes of d.
HWY_INLINE VF Incidence(DF df, const float* d, ptrdiff_t stride, const Light& l, float half) {
    const VF h = hn::Set(df, half);
    const VF gx = hn::Mul(hn::Sub(hn::LoadU(df, d - 1), hn::LoadU(df, d + 1)), h);
    const VF gy = hn::Mul(hn::Sub(hn::LoadU(df, d - stride), hn::LoadU(df, d + stride)), h);
    const VF towards = hn::Sub(hn::Sub(hn::Set(df, l.normalZ * l.z), hn::Mul(hn::Set(df, l.x), gx)),
                               hn::Mul(hn::Set(df, l.y), gy));
    const VF sum = hn::Add(hn::Add(hn::Set(df, l.normalZ * l.normalZ), hn::Mul(gx, gx)), hn::Mul(gy, gy));
    return hn::Div(towards, FastSqrt(df, sum));
}

// ReliefClampLevel.
HWY_INLINE VF ClampLevel(DF df, VF level) {
    const VF most = hn::Set(df, 255.0f);
    level = hn::IfThenElse(hn::Gt(level, most), most, level);
    return hn::IfThenElse(hn::Ge(level, hn::Zero(df)), level, hn::Zero(df));
}

// ReliefEdgeFactor.
HWY_INLINE VI EdgeFactor(DF df, VF e) {
    const VF zero = hn::Zero(df);
    const VF one = hn::Set(df, 1.0f);
    e = hn::IfThenElse(hn::Gt(e, zero), e, zero);
    e = hn::IfThenElse(hn::Gt(e, one), one, e);
    VF scaled = hn::Add(hn::Mul(e, hn::Set(df, 255.0f)), hn::Set(df, 0.5f));
    scaled = hn::IfThenElse(hn::Gt(scaled, hn::Set(df, 255.0f)), hn::Set(df, 255.0f), scaled);
    return hn::ConvertTo(DI(), scaled);
}

// ReliefPlaneValue.
HWY_INLINE VI PlaneValue(DI di, VI amount, VI edge) {
    const VI product = hn::Mul(hn::Add(hn::ShiftRight<8>(amount), hn::Set(di, 1)), edge);
    const VI high = hn::Set(di, 255);
    VI v = hn::ShiftRight<8>(product);
    v = hn::IfThenElse(hn::Lt(product, hn::Zero(di)), hn::Zero(di), v);
    return hn::IfThenElse(hn::Gt(product, hn::Set(di, 65535)), high, v);  // product >= 65536
}

// Stores the plane lanes where `write`, the loaded bytes elsewhere.
HWY_INLINE void StorePlanes(hn::Mask<DI> write, VI second, VI first, uint8_t* secondOut, uint8_t* firstOut) {
    const DI di;
    const D8 d8;
    second = hn::IfThenElse(write, second, hn::PromoteTo(di, hn::LoadU(d8, secondOut)));
    first = hn::IfThenElse(write, first, hn::PromoteTo(di, hn::LoadU(d8, firstOut)));
    hn::StoreU(hn::DemoteTo(d8, second), d8, secondOut);
    hn::StoreU(hn::DemoteTo(d8, first), d8, firstOut);
}
#endif

void BevelLight(const float* HWY_RESTRICT d, ptrdiff_t stride, int n, const Light& l, uint8_t* HWY_RESTRICT second,
                uint8_t* HWY_RESTRICT first) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const int N = int(hn::Lanes(df));
    const VF range = hn::Set(df, l.range);
    const VI secondAlpha = hn::Set(di, l.secondAlpha);
    const VI firstAlpha = hn::Set(di, l.firstAlpha);
    for (; x + N <= n; x += N) {
        const VF here = hn::LoadU(df, d + x);
        const auto lit = hn::RebindMask(di, hn::Ne(here, range));
        if (hn::AllFalse(di, lit)) continue;
        const VF level = ClampLevel(df, hn::Mul(Incidence(df, d + x, stride, l, 0.5f), hn::Set(df, 255.0f)));
        const VF v = l.inside ? level : hn::ConvertTo(df, hn::Sub(hn::Set(di, 255), hn::ConvertTo(di, level)));
        const VI edge = EdgeFactor(df, hn::Sub(range, here));
        const VI s = PlaneValue(di, hn::Mul(secondAlpha, hn::ConvertTo(di, hn::Add(v, hn::Set(df, 1.0f)))), edge);
        const VI f = PlaneValue(di, hn::Mul(hn::Sub(hn::Set(di, 256), hn::ConvertTo(di, v)), firstAlpha), edge);
        StorePlanes(lit, s, f, second + x, first + x);
    }
#endif
    for (; x < n; ++x) Scalar::BevelPixel(d + x, stride, l, second + x, first + x);
}

void EmbossHardLight(const float* HWY_RESTRICT f, ptrdiff_t stride, int n, const Light& l,
                     uint8_t* HWY_RESTRICT second, uint8_t* HWY_RESTRICT first) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const int N = int(hn::Lanes(df));
    const VF outRange = hn::Set(df, l.range);
    const VI secondAlpha = hn::Set(di, l.secondAlpha);
    const VI firstAlpha = hn::Set(di, l.firstAlpha);
    for (; x + N <= n; x += N) {
        const VF here = hn::LoadU(df, f + x);
        const auto lit = hn::RebindMask(di, hn::Ne(here, outRange));
        if (hn::AllFalse(di, lit)) continue;
        const VI level = hn::ConvertTo(
            di, ClampLevel(df, hn::Mul(Incidence(df, f + x, stride, l, 0.5f), hn::Set(df, 255.0f))));
        const VF e = hn::IfThenElse(hn::Gt(here, hn::Zero(df)), hn::Sub(outRange, here),
                                    hn::Sub(hn::Add(here, hn::Set(df, l.inRange)), hn::Set(df, 1.0f)));
        const VI edge = EdgeFactor(df, e);
        const VI s = PlaneValue(di, hn::Mul(hn::Sub(hn::Set(di, 256), level), secondAlpha), edge);
        const VI t = PlaneValue(di, hn::Mul(hn::Add(level, hn::Set(di, 1)), firstAlpha), edge);
        StorePlanes(lit, s, t, second + x, first + x);
    }
#endif
    for (; x < n; ++x) Scalar::EmbossHardPixel(f + x, stride, l, second + x, first + x);
}

void EmbossSoftLight(const float* HWY_RESTRICT o, const float* HWY_RESTRICT in, ptrdiff_t stride, int n,
                     const Light& l, uint8_t* HWY_RESTRICT second, uint8_t* HWY_RESTRICT first) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const D8 d8;
    const int N = int(hn::Lanes(df));
    const VF zero = hn::Zero(df);
    const VF outRange = hn::Set(df, l.range);
    const VF inRange = hn::Set(df, l.inRange);
    const VI secondAlpha = hn::Set(di, l.secondAlpha);
    const VI firstAlpha = hn::Set(di, l.firstAlpha);
    for (; x + N <= n; x += N) {
        const VF outer = hn::LoadU(df, o + x);
        const VF inner = hn::LoadU(df, in + x);
        const auto outLit = hn::RebindMask(di, hn::And(hn::Gt(outer, zero), hn::Lt(outer, outRange)));
        const auto inLit = hn::RebindMask(di, hn::And(hn::Gt(inner, zero), hn::Lt(inner, inRange)));
        if (hn::AllFalse(di, hn::Or(outLit, inLit))) continue;
        VI s = hn::PromoteTo(di, hn::LoadU(d8, second + x));
        VI t = hn::PromoteTo(di, hn::LoadU(d8, first + x));
        if (!hn::AllFalse(di, outLit)) {
            const VI level = hn::ConvertTo(
                di, ClampLevel(df, hn::Mul(Incidence(df, o + x, stride, l, 0.5f), hn::Set(df, 255.0f))));
            const VI edge = EdgeFactor(df, hn::Sub(outRange, outer));
            s = hn::IfThenElse(outLit, PlaneValue(di, hn::Mul(hn::Sub(hn::Set(di, 256), level), secondAlpha), edge), s);
            t = hn::IfThenElse(outLit, PlaneValue(di, hn::Mul(hn::Add(level, hn::Set(di, 1)), firstAlpha), edge), t);
        }
        if (!hn::AllFalse(di, inLit)) {
            const VF incidence = Incidence(df, in + x, stride, l, -0.5f);
            const VI level =
                hn::ConvertTo(di, ClampLevel(df, hn::Mul(hn::Sub(hn::Set(df, 1.0f), incidence), hn::Set(df, 255.0f))));
            const VI edge = EdgeFactor(df, hn::Sub(inRange, inner));
            s = hn::IfThenElse(inLit, PlaneValue(di, hn::Mul(hn::Add(level, hn::Set(di, 1)), secondAlpha), edge), s);
            t = hn::IfThenElse(inLit, PlaneValue(di, hn::Mul(hn::Sub(hn::Set(di, 256), level), firstAlpha), edge), t);
        }
        hn::StoreU(hn::DemoteTo(d8, s), d8, second + x);
        hn::StoreU(hn::DemoteTo(d8, t), d8, first + x);
    }
#endif
    for (; x < n; ++x) Scalar::EmbossSoftPixel(o + x, in + x, stride, l, second + x, first + x);
}

#if HWY_TARGET != HWY_SCALAR
// The span in vectors of D: whole ones, then one more ending at the span's
// end, overlapping the last (a minimum taken twice is the same minimum).
// false when the span is shorter than one vector.
template <class D>
HWY_INLINE bool SweepVectors(D d, float* HWY_RESTRICT out, const float* HWY_RESTRICT roots, int n, float amount) {
    const int N = int(hn::Lanes(d));
    if (n < N) return false;
    const auto a = hn::Set(d, amount);
    auto one = [&](int i) {
        const auto candidate = hn::Add(a, hn::LoadU(d, roots + i));
        const auto value = hn::LoadU(d, out + i);
        hn::StoreU(hn::IfThenElse(hn::Lt(candidate, value), candidate, value), d, out + i);
    };
    int i = 0;
    for (; i + N <= n; i += N) one(i);
    if (i < n) one(n - N);
    return true;
}
#endif

void SweepSource(float* HWY_RESTRICT field, ptrdiff_t stride, int width, int x, int sourceRow, int rowBegin,
                 int rowEnd, int left, int right, const Disc& disc, float amount) {
    for (int y = rowBegin; y < rowEnd; ++y) {
        const Scalar::Span span = Scalar::SweepSpanOf(width, x, sourceRow, y, left, right, disc);
        float* out = field + ptrdiff_t(y) * stride + span.begin;
        const int n = span.end - span.begin;
#if HWY_TARGET != HWY_SCALAR
        // Short spans (the discs' ends, one-sided sweeps) take narrower vectors.
        const hn::ScalableTag<float> full;
        const hn::CappedTag<float, 8> eight;
        const hn::CappedTag<float, 4> four;
        if (SweepVectors(full, out, span.roots, n, amount) || SweepVectors(eight, out, span.roots, n, amount) ||
            SweepVectors(four, out, span.roots, n, amount)) {
            continue;
        }
#endif
        Scalar::SweepSpan(out, span.roots, n, amount);
    }
}

void SweepSides(const float* HWY_RESTRICT above, const float* HWY_RESTRICT row, const float* HWY_RESTRICT below,
                int n, bool positive, uint8_t* HWY_RESTRICT sides) {
    int x = 1;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const D8 d8;
    const int N = int(hn::Lanes(df));
    const VF one = hn::Set(df, 1.0f);
    const VF zero = hn::Zero(df);
    auto amountOf = [&](VF v) { return positive ? hn::IfThenElse(hn::Gt(v, zero), v, zero) : v; };
    for (; x + N + 1 <= n; x += N) {
        const VF v = hn::LoadU(df, row + x);
        const VF amount = amountOf(v);
        // A side's bit where the neighbour does not serve.
        auto bit = [&](VF neighbour, int value) {
            const auto serves = hn::And(hn::Lt(neighbour, one), hn::Le(amountOf(neighbour), amount));
            return hn::IfThenZeroElse(hn::RebindMask(di, serves), hn::Set(di, value));
        };
        VI bits = hn::Or(hn::Or(bit(hn::LoadU(df, row + x - 1), 1), bit(hn::LoadU(df, row + x + 1), 2)),
                         hn::Or(bit(hn::LoadU(df, above + x), 4), bit(hn::LoadU(df, below + x), 8)));
        bits = hn::IfThenElseZero(hn::RebindMask(di, hn::Lt(v, one)), bits);
        hn::StoreU(hn::DemoteTo(d8, bits), d8, sides + x);
    }
#endif
    for (; x + 1 < n; ++x) sides[x] = Scalar::SidesOf(above[x], row[x - 1], row[x], row[x + 1], below[x], positive);
}

void NearRow(const float* HWY_RESTRICT line, int radius, int n, float* HWY_RESTRICT out) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const int N = int(hn::Lanes(df));
    for (; x + N <= n; x += N) {
        VF best = hn::LoadU(df, line + x);
        for (int dx = 1; dx <= radius; ++dx) {
            const VF square = hn::Set(df, float(dx * dx));
            const VF left = hn::Add(hn::LoadU(df, line + x - dx), square);
            const VF right = hn::Add(hn::LoadU(df, line + x + dx), square);
            best = hn::IfThenElse(hn::Lt(left, best), left, best);
            best = hn::IfThenElse(hn::Lt(right, best), right, best);
        }
        hn::StoreU(best, df, out + x);
    }
#endif
    for (; x < n; ++x) out[x] = Scalar::NearPixel(line + x, radius);
}

void InwardRow(const float* HWY_RESTRICT sources, ptrdiff_t stride, int above, int below, int radius,
               const float* HWY_RESTRICT roots, const float* HWY_RESTRICT cur, float* HWY_RESTRICT out, int n) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const int N = int(hn::Lanes(df));
    const int side = 2 * radius + 1;
    for (; x + N <= n; x += N) {
        const VF start = hn::LoadU(df, cur + x);
        const auto target = hn::Lt(start, hn::Zero(df));
        if (hn::AllFalse(df, target)) {
            hn::StoreU(start, df, out + x);
            continue;
        }
        VF best = start;
        for (int a = -above; a <= below; ++a) {
            const float* s = sources + ptrdiff_t(a) * stride + x;
            const float* r = roots + ptrdiff_t(a + radius) * side + radius;
            for (int dx = -radius; dx <= radius; ++dx) {
                const VF candidate = hn::Sub(hn::LoadU(df, s + dx), hn::Set(df, r[dx]));
                best = hn::IfThenElse(hn::Lt(best, candidate), candidate, best);
            }
        }
        hn::StoreU(hn::IfThenElse(target, best, start), df, out + x);
    }
#endif
    for (; x < n; ++x) out[x] = Scalar::InwardPixel(sources + x, stride, above, below, radius, roots, cur[x]);
}

void Colourise(const uint8_t* HWY_RESTRICT first, const uint8_t* HWY_RESTRICT second, int n, float gain,
               uint32_t firstColour, uint32_t secondColour, uint32_t* HWY_RESTRICT out) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const D8 d8;
    const hn::RebindToUnsigned<DI> du;
    const int N = int(hn::Lanes(df));
    const VF g = hn::Set(df, gain);
    const VI zero = hn::Zero(di);
    const VI most = hn::Set(di, 255);
    for (; x + N <= n; x += N) {
        const VI s = hn::ConvertTo(di, hn::Mul(g, hn::ConvertTo(df, hn::PromoteTo(di, hn::LoadU(d8, first + x)))));
        const VI l = hn::ConvertTo(di, hn::Mul(g, hn::ConvertTo(df, hn::PromoteTo(di, hn::LoadU(d8, second + x)))));
        const VI d = hn::Sub(s, l);
        const auto firstWins = hn::Gt(d, zero);
        const VI alpha = hn::Min(hn::Abs(d), most);
        VI word = hn::ShiftLeft<24>(alpha);
        for (int shift = 16; shift >= 0; shift -= 8) {
            const VI channel = hn::IfThenElse(firstWins, hn::Set(di, int((firstColour >> shift) & 0xFF)),
                                              hn::Set(di, int((secondColour >> shift) & 0xFF)));
            const VI v = hn::Min(hn::ShiftRight<8>(hn::Mul(hn::Add(channel, hn::Set(di, 1)), alpha)), most);
            word = hn::Or(word, hn::ShiftLeftSame(v, shift));
        }
        hn::StoreU(hn::BitCast(du, word), du, out + x);
    }
#endif
    for (; x < n; ++x) out[x] = Scalar::ColourPixel(first[x], second[x], gain, firstColour, secondColour);
}

#if HWY_TARGET != HWY_SCALAR
// int(gain * b) of the lanes' bytes.
HWY_INLINE VI Tone(DF df, VF gain, const uint8_t* bytes) {
    const DI di;
    return hn::ConvertTo(di, hn::Mul(gain, hn::ConvertTo(df, hn::PromoteTo(di, hn::LoadU(D8(), bytes)))));
}

// WeightedAlpha.
HWY_INLINE VI Weighted(DI di, VI difference, VI weight) {
    const VI product = hn::Mul(hn::Add(difference, hn::Set(di, 1)), weight);
    return hn::IfThenElse(hn::Gt(product, hn::Set(di, 65535)), hn::Set(di, 255), hn::ShiftRight<8>(product));
}
#endif

void TwoSided(const uint8_t* HWY_RESTRICT normalFirst, const uint8_t* HWY_RESTRICT normalSecond,
              const uint8_t* HWY_RESTRICT mirroredFirst, const uint8_t* HWY_RESTRICT mirroredSecond,
              const uint8_t* HWY_RESTRICT coverage, int n, float gain, uint32_t firstColour, uint32_t secondColour,
              uint32_t* HWY_RESTRICT out) {
    int x = 0;
#if HWY_TARGET != HWY_SCALAR
    const DF df;
    const DI di;
    const D8 d8;
    const hn::RebindToUnsigned<DI> du;
    const int N = int(hn::Lanes(df));
    const VF g = hn::Set(df, gain);
    const VI zero = hn::Zero(di);
    const VI one = hn::Set(di, 1);
    const VI most = hn::Set(di, 255);
    for (; x + N <= n; x += N) {
        const VI d1 = hn::Sub(Tone(df, g, normalFirst + x), Tone(df, g, normalSecond + x));
        const VI d2 = hn::Sub(Tone(df, g, mirroredFirst + x), Tone(df, g, mirroredSecond + x));
        const VI m = hn::PromoteTo(di, hn::LoadU(d8, coverage + x));
        const VI alpha1 = Weighted(di, hn::Abs(d1), m);
        const VI alpha2 = Weighted(di, hn::Abs(d2), hn::Sub(most, m));
        const auto first1 = hn::Gt(d1, zero);
        const auto first2 = hn::Gt(d2, zero);
        const VI k = hn::Sub(most, alpha1);
        VI c1 = hn::ShiftLeft<24>(alpha1);
        VI c2 = hn::ShiftLeft<24>(alpha2);
        VI blend = hn::ShiftLeft<24>(hn::Min(hn::Add(alpha1, hn::ShiftRight<8>(hn::Mul(k, hn::Add(alpha2, one)))), most));
        for (int shift = 16; shift >= 0; shift -= 8) {
            const VI firstChannel = hn::Set(di, int((firstColour >> shift) & 0xFF) + 1);
            const VI secondChannel = hn::Set(di, int((secondColour >> shift) & 0xFF) + 1);
            const VI tint1 = hn::Min(hn::ShiftRight<8>(hn::Mul(hn::IfThenElse(first1, firstChannel, secondChannel), alpha1)), most);
            const VI tint2 = hn::Min(hn::ShiftRight<8>(hn::Mul(hn::IfThenElse(first2, firstChannel, secondChannel), alpha2)), most);
            c1 = hn::Or(c1, hn::ShiftLeftSame(tint1, shift));
            c2 = hn::Or(c2, hn::ShiftLeftSame(tint2, shift));
            const VI mixed = hn::Min(hn::Add(tint1, hn::ShiftRight<8>(hn::Mul(k, hn::Add(tint2, one)))), most);
            blend = hn::Or(blend, hn::ShiftLeftSame(mixed, shift));
        }
        VI word = hn::IfThenElse(hn::Eq(alpha1, most), c1, blend);
        word = hn::IfThenElse(hn::Eq(alpha1, zero), c2, word);
        hn::StoreU(hn::BitCast(du, word), du, out + x);
    }
#endif
    for (; x < n; ++x) {
        out[x] = Scalar::TwoSidedPixel(normalFirst[x], normalSecond[x], mirroredFirst[x], mirroredSecond[x],
                                       coverage[x], gain, firstColour, secondColour);
    }
}

const Table* GetTable() {
    static const Table table = {BevelLight, EmbossHardLight, EmbossSoftLight, SweepSource, SweepSides, NearRow,
                                InwardRow, Colourise, TwoSided};
    return &table;
}

}  // namespace Glimmer::ReliefRows::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "effect/GxKernelTargets.h"

namespace Glimmer::ReliefRows {

namespace Reference {
void BevelLight(const float* d, ptrdiff_t stride, int n, const Light& light, uint8_t* second, uint8_t* first) {
    for (int x = 0; x < n; ++x) Scalar::BevelPixel(d + x, stride, light, second + x, first + x);
}
void EmbossHardLight(const float* f, ptrdiff_t stride, int n, const Light& light, uint8_t* second,
                     uint8_t* first) {
    for (int x = 0; x < n; ++x) Scalar::EmbossHardPixel(f + x, stride, light, second + x, first + x);
}
void EmbossSoftLight(const float* o, const float* in, ptrdiff_t stride, int n, const Light& light,
                     uint8_t* second, uint8_t* first) {
    for (int x = 0; x < n; ++x) Scalar::EmbossSoftPixel(o + x, in + x, stride, light, second + x, first + x);
}
void SweepSource(float* field, ptrdiff_t stride, int width, int x, int sourceRow, int rowBegin, int rowEnd,
                 int left, int right, const Disc& disc, float amount) {
    for (int y = rowBegin; y < rowEnd; ++y) {
        const Scalar::Span span = Scalar::SweepSpanOf(width, x, sourceRow, y, left, right, disc);
        Scalar::SweepSpan(field + ptrdiff_t(y) * stride + span.begin, span.roots, span.end - span.begin, amount);
    }
}
void SweepSides(const float* above, const float* row, const float* below, int n, bool positive, uint8_t* sides) {
    for (int x = 1; x + 1 < n; ++x)
        sides[x] = Scalar::SidesOf(above[x], row[x - 1], row[x], row[x + 1], below[x], positive);
}
void NearRow(const float* line, int radius, int n, float* out) {
    for (int x = 0; x < n; ++x) out[x] = Scalar::NearPixel(line + x, radius);
}
void InwardRow(const float* sources, ptrdiff_t stride, int above, int below, int radius, const float* roots,
               const float* cur, float* out, int n) {
    for (int x = 0; x < n; ++x) out[x] = Scalar::InwardPixel(sources + x, stride, above, below, radius, roots, cur[x]);
}
void Colourise(const uint8_t* first, const uint8_t* second, int n, float gain, uint32_t firstColour,
               uint32_t secondColour, uint32_t* out) {
    for (int x = 0; x < n; ++x) out[x] = Scalar::ColourPixel(first[x], second[x], gain, firstColour, secondColour);
}
void TwoSided(const uint8_t* normalFirst, const uint8_t* normalSecond, const uint8_t* mirroredFirst,
              const uint8_t* mirroredSecond, const uint8_t* coverage, int n, float gain, uint32_t firstColour,
              uint32_t secondColour, uint32_t* out) {
    for (int x = 0; x < n; ++x) {
        out[x] = Scalar::TwoSidedPixel(normalFirst[x], normalSecond[x], mirroredFirst[x], mirroredSecond[x],
                                       coverage[x], gain, firstColour, secondColour);
    }
}
}  // namespace Reference

const Table& ReferenceTable() {
    static const Table table = {Reference::BevelLight, Reference::EmbossHardLight, Reference::EmbossSoftLight,
                                Reference::SweepSource, Reference::SweepSides, Reference::NearRow,
                                Reference::InwardRow, Reference::Colourise, Reference::TwoSided};
    return table;
}

#include "effect/GxKernelBuilds.inc"

const Table& Active() {
    static const Table* table = KernelTargets::Choose<Table>(kBuilds);
    return *table;
}

std::vector<Variant> Variants() { return KernelTargets::All<Variant>(kBuilds); }

}  // namespace Glimmer::ReliefRows
#endif  // HWY_ONCE
