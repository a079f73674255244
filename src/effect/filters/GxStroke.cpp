// Stroke: a band of a given width along the glyph edges.
//
// The stroke is a soft morphological dilation. A disc kernel of radius r
// (makeCircleKernel: anti-aliased coverage bytes, D = 2R + 1 on a side with
// R = trunc(r + 0.5)) is stamped at every source pixel; a source value v
// under a kernel byte k proposes v + k - 255 (never below 0) for that output
// cell, and each cell keeps the largest proposal. The sum rather than a
// product is deliberate: a cell is full only where both the source pixel and
// the kernel cell are full, and coverage falls off linearly in both.
//
// What is dilated depends on the position:
// - outside (1): the mask itself, r = size. The result also covers the glyph
//   interior; drawn destination-over under the text only the outer band shows.
// - inside (2, and any unknown position): the inverse mask, r = size. The
//   result is 255 everywhere outside the glyphs and in a band r deep inside
//   them. The filter draws all of it; whoever composites decides what shows.
// - centre (0): both, r = size / 2, into two planes; their minimum is the
//   band of width 2r straddling the edge.
//
// The text rectangle is first copied into a plane with a one-pixel frame of
// zeros, and the output plane is that plane grown by R on every side, so a
// stamp never leaves it and the band functions need no clipping.
//
// Deliberate quirks, kept: the kernel's centre cell is clamp(r, 0, 1) * 255
// whatever the distance rule gives elsewhere, so a radius below 1 has a
// centre weaker than full (r = 0.5 gives 128 where the rule gives 255); and
// a size of 0 gives a single kernel cell of 0, i.e. no stroke at all. The
// stroke uses exact single-precision square roots, not the relief filters'
// fsqrt.
//
// Speed. Stamping costs D^2 per source pixel. Take a pixel none of whose
// eight neighbours has a smaller value. For any cell c but its own, the
// neighbour one step toward c proposes at least as much there: its value is
// no smaller and the disc is no weaker one step nearer its centre. Walking
// such steps ends at a pixel that stamps in full, or at the pixel under c,
// which proposes at its own centre cell. So such a pixel only needs to write
// its centre cell: glyph interiors cost O(1) a pixel and full stamps run
// along the edges. The rule ("no weaker one step nearer the centre") is
// checked on the kernel at hand first, so any kernel gives the result of
// plain stamping.

#include "effect/filters/GxStroke.h"

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <new>

#include "effect/GxBlender.h"
#include "effect/filters/GxFilterLimits.h"
#include "effect/filters/GxLayerSupport.h"

namespace Glimmer {

namespace {

// clamp(v, 0, 1) * 255 + 0.5, clamped to 0..255 and truncated.
unsigned char CoverageByte(float v) {
    if (v < 0.0f) v = 0.0f;
    if (v > 1.0f) v = 1.0f;
    v = v * 255.0f + 0.5f;
    if (v > 255.0f) v = 255.0f;
    if (v < 0.0f) v = 0.0f;
    return static_cast<unsigned char>(static_cast<int>(v));
}

// Columns [first, end) of a kernel row hold its non-zero bytes, the largest
// being `peak`: zero bytes never win a cell, and a row whose peak does not
// exceed 255 - v proposes nothing for a source value v, so stamps skip both.
struct Span {
    int first = 0;
    int end = 0;
    int peak = 0;
};

// Kernels come from makeCircleKernel, so D is at most 2 * kMaxFilterRadius + 1.
inline constexpr int kMaxKernelSize = 2 * kMaxFilterRadius + 1;

struct KernelPlan {
    Span spans[kMaxKernelSize];
    int centre = 0;             // offset of the centre cell in the kernel
    bool interiorSkip = false;  // the neighbour rule is exact for this kernel
};

// The neighbour rule needs, for every non-zero cell e != 0, the cell one step
// toward the centre (e - sign(e)) to be at least as strong.
bool NeighbourRuleHolds(const unsigned char* k, int D) {
    const int half = (D - 1) >> 1;
    for (int y = 0; y < D; ++y) {
        for (int x = 0; x < D; ++x) {
            const int ey = y - half, ex = x - half;
            if ((ey == 0 && ex == 0) || k[y * D + x] == 0) continue;
            const int iy = y - (ey > 0) + (ey < 0), ix = x - (ex > 0) + (ex < 0);
            if (k[iy * D + ix] < k[y * D + x]) return false;
        }
    }
    return true;
}

bool PlanKernel(const StrokeJob& job, KernelPlan* plan) {
    const int D = job.kernelSize;
    if (D <= 0 || (D & 1) == 0 || D > kMaxKernelSize) return false;
    for (int y = 0; y < D; ++y) {
        const unsigned char* row = job.kernel + size_t(y) * D;
        int first = 0;
        while (first < D && row[first] == 0) ++first;
        int end = D;
        while (end > first && row[end - 1] == 0) --end;
        int peak = 0;
        for (int x = first; x < end; ++x) peak = row[x] > peak ? row[x] : peak;
        plan->spans[y] = Span{first, end, peak};
    }
    const int half = (D - 1) >> 1;
    plan->centre = half * D + half;
    plan->interiorSkip = NeighbourRuleHolds(job.kernel, D);
    return true;
}

// Proposes v + k - 255 to every cell of the D x D block at `out`.
inline void Stamp(unsigned char* out, int stride, const unsigned char* kernel, int D,
                  const Span* spans, int v) {
    const int cut = 255 - v;
    for (int ky = 0; ky < D; ++ky, out += stride, kernel += D) {
        // Bounds in locals and a plain max (every cell stored) so that it
        // vectorises.
        if (spans[ky].peak <= cut) continue;
        const int first = spans[ky].first, end = spans[ky].end;
        for (int kx = first; kx < end; ++kx) {
            const int t = kernel[kx] - cut;
            const int o = out[kx];
            out[kx] = static_cast<unsigned char>(t > o ? t : o);
        }
    }
}

// Spreads the mask (kInverse false) or its inverse into `plane` for the job's
// rows. Source bytes are read as 255 - a for the inverse.
template <bool kInverse>
void SpreadBand(const StrokeJob& job, unsigned char* plane, const KernelPlan& plan) {
    const int D = job.kernelSize;
    const int half = (D - 1) >> 1;
    const ptrdiff_t srcStride = job.srcStride;
    const ptrdiff_t dstStride = job.dstStride;
    auto value = [](unsigned char a) { return kInverse ? 255 - int(a) : int(a); };

    for (int y = job.rowBegin; y < job.rowEnd; ++y) {
        const unsigned char* row = job.paddedMask + (job.srcTop + y) * srcStride + job.srcLeft;
        unsigned char* outRow = plane + (job.dstTop + y - half) * dstStride + (job.dstLeft - half);
        const bool innerRow = plan.interiorSkip && y > 0 && y < job.height - 1;
        for (int x = 0; x < job.width; ++x) {
            const int v = value(row[x]);
            if (v == 0) continue;
            unsigned char* origin = outRow + x;
            if (innerRow && x > 0 && x < job.width - 1) {
                const unsigned char* up = row - srcStride + x;
                const unsigned char* down = row + srcStride + x;
                if (value(up[-1]) >= v && value(up[0]) >= v && value(up[1]) >= v &&
                    value(row[x - 1]) >= v && value(row[x + 1]) >= v &&
                    value(down[-1]) >= v && value(down[0]) >= v && value(down[1]) >= v) {
                    unsigned char* c = origin + half * dstStride + half;
                    const int t = job.kernel[plan.centre] - (255 - v);
                    if (t > *c) *c = static_cast<unsigned char>(t);
                    continue;
                }
            }
            Stamp(origin, int(dstStride), job.kernel, D, plan.spans, v);
        }
    }
}

}  // namespace

int makeCircleKernel(unsigned char** out, float radius) {
    const float reach = radius + 0.5f;
    if (!(reach > -1.0f) || reach >= float(kMaxFilterRadius + 1)) return 0;
    const int R = static_cast<int>(reach);
    const int D = 2 * R + 1;
    auto* k = static_cast<unsigned char*>(std::malloc(size_t(D) * size_t(D)));
    if (k == nullptr) return D;
    *out = k;
    for (int y = 0; y < D; ++y) {
        for (int x = 0; x < D; ++x) {
            const int dy = std::abs(y - R), dx = std::abs(x - R);
            const float d = std::sqrt(float(dx * dx + dy * dy));
            k[y * D + x] = CoverageByte((radius - d) + 1.0f);
        }
    }
    // Deliberate: the centre follows the radius, not the distance rule.
    k[R * D + R] = CoverageByte(radius);
    return D;
}

void* GxStroke::partalDTStrokeCenter(void* arg) {
    auto* job = static_cast<StrokeJob*>(arg);
    KernelPlan plan;
    if (job == nullptr || job->kernel == nullptr || !PlanKernel(*job, &plan)) return nullptr;
    SpreadBand<false>(*job, job->outPlanes, plan);
    SpreadBand<true>(*job, job->outPlanes + job->planeSize, plan);
    return nullptr;
}

void* GxStroke::partalDTStrokeOutside(void* arg) {
    auto* job = static_cast<StrokeJob*>(arg);
    KernelPlan plan;
    if (job == nullptr || job->kernel == nullptr || !PlanKernel(*job, &plan)) return nullptr;
    SpreadBand<false>(*job, job->outPlanes, plan);
    return nullptr;
}

void* GxStroke::partalDTStrokeInside(void* arg) {
    auto* job = static_cast<StrokeJob*>(arg);
    KernelPlan plan;
    if (job == nullptr || job->kernel == nullptr || !PlanKernel(*job, &plan)) return nullptr;
    SpreadBand<true>(*job, job->outPlanes, plan);
    return nullptr;
}

GxStroke::GxStroke() { style = GxECore::kStroke; }

GxStroke::~GxStroke() { delete property; }

void GxStroke::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxStrokeProperty*>(p);
    if (source == nullptr) return;
    auto* copy = new (std::nothrow)
        GxStrokeProperty(source->size, source->color, source->opacity, source->a, source->position);
    delete property;
    property = copy;
}

GxProperty* GxStroke::getProperty() { return property; }

int32_t GxStroke::getOffset() {
    if (property == nullptr) return 0;
    float margin;
    if (property->position == 1) {
        margin = property->size + 0.5f;
    } else if (property->position == 0) {
        margin = property->size * 0.5f + 0.5f;
    } else {
        return 0;
    }
    // Same bounds as makeCircleKernel: a radius it refuses draws nothing.
    if (!(margin >= 0.0f) || margin >= float(kMaxFilterRadius + 1)) return 0;
    return static_cast<int32_t>(margin);
}

void GxStroke::doPostProcessing(GxECore::ParamPostProcessing* p) {
    if (p == nullptr || property == nullptr || p->textRect == nullptr || p->dst == nullptr ||
        p->src == nullptr)
        return;
    const GxBitmap& src = *p->src;
    GxRect rect;
    if (p->dst->pixels == nullptr || !ClipBoxToMask(*p->textRect, src, &rect)) return;

    const int position = property->position;
    const float radius = position != 0 ? property->size : property->size * 0.5f;
    unsigned char* rawKernel = nullptr;
    const int D = makeCircleKernel(&rawKernel, radius);
    WorkBuffer<unsigned char> kernel(rawKernel);
    if (!kernel) return;
    const int R = D >> 1;

    // Text rectangle inside a one-pixel frame of zeros.
    const int64_t paddedW = int64_t(rect.right) - rect.left + 2;
    const int64_t paddedH = int64_t(rect.bottom) - rect.top + 2;
    size_t paddedBytes = 0;
    if (paddedW > INT32_MAX || paddedH > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(paddedW), unsigned(paddedH), 1, &paddedBytes))
        return;
    const int W = int(paddedW);
    const int H = int(paddedH);
    WorkBuffer<unsigned char> padded = AllocateWork<unsigned char>(paddedBytes);
    if (!padded) return;
    unsigned char* pad = padded.get();
    std::memset(pad, 0, size_t(W));
    for (int i = 1; i <= H - 2; ++i) {
        unsigned char* row = pad + size_t(i) * W;
        row[0] = 0;
        std::memcpy(row + 1, src.pixels + size_t(rect.top + i - 1) * src.width + rect.left,
                    size_t(W - 2));
        row[W - 1] = 0;
    }
    std::memset(pad + size_t(H - 1) * W, 0, size_t(W));

    // Output: the padded plane grown by R on every side (two planes in centre mode).
    const int64_t Wo = int64_t(W) + 2 * R;
    const int64_t Ho = int64_t(H) + 2 * R;
    const unsigned planes = position == 0 ? 2 : 1;
    size_t outBytes = 0;
    if (Wo > INT32_MAX || Ho > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(Wo), unsigned(Ho), planes, &outBytes))
        return;
    WorkBuffer<unsigned char> output = AllocateWork<unsigned char>(outBytes, true);
    if (!output) return;
    const int planeSize = int(Wo * Ho);

    StrokeJob job;
    job.outPlanes = output.get();
    job.paddedMask = pad;
    job.kernel = kernel.get();
    job.srcStride = W;
    job.srcHeight = H;
    job.srcTop = 0;
    job.srcLeft = 0;
    job.dstStride = int(Wo);
    job.dstHeight = int(Ho);
    job.dstTop = R;
    job.dstLeft = R;
    job.planeSize = planeSize;
    job.radius = static_cast<int32_t>(radius);
    job.kernelSize = D;
    job.width = W;
    job.height = H;
    job.rowBegin = 0;
    job.rowEnd = H;
    if (position == 0) {
        partalDTStrokeCenter(&job);
        unsigned char* band = output.get();
        const unsigned char* inverse = band + planeSize;
        for (int i = 0; i < planeSize; ++i) band[i] = band[i] < inverse[i] ? band[i] : inverse[i];
    } else if (position == 1) {
        partalDTStrokeOutside(&job);
    } else {
        partalDTStrokeInside(&job);
    }

    const int mode = (p->separateWorkImage == 1 || position != 0) ? GxE_BLEND_DST_OVER : GxE_BLEND_SRC_OVER;
    const int x = rect.left - 1 - R;
    const int y = rect.top - 1 - R;
    GxBlender::drawBitmapBlend8(x, y, p->dst, output.get(), int(Wo), int(Ho), int(Wo), property->color, mode);
    if (p->extraDst != nullptr)
        GxBlender::drawBitmapBlend8(x, y, p->extraDst, output.get(), int(Wo), int(Ho), int(Wo), property->color,
                                    mode);
}

}  // namespace Glimmer
