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
// plain stamping. The band functions below work this way.
//
// The layer gets the same bytes the other way round, per output pixel, by
// chords (StrokeChords). Every row of a disc kernel is symmetric and never
// grows away from its centre column, so it is the maximum of nested centred
// runs, one per coverage level t it holds: t on columns |dx| <= w. A kernel
// row's best proposal at an output pixel is then the maximum over its levels
// of (largest source sample on the run) + t - 255, floored at 0: pairing an
// inner sample with an outer, weaker level proposes less than that sample
// really does, so it never wins. The largest sample on a run of 2w + 1 is the
// larger of two spans of 2^j samples (2^j <= 2w + 1 < 2^(j+1)) that cover it
// exactly, read from tables of span maxima built once per drawing; a term
// (kernel row, level) thus costs two reads a pixel whatever its length, and
// a whole block of pixels goes through it at once (GxStrokeRows). The full
// levels (t = 255, the disc's inside) come first, centre row outward, and a
// block that they fill to 255 is finished without the rim levels. A kernel
// row whose source row holds only zeros proposes nothing at any level, so
// its terms are left out of the output row's list (and its span tables are
// not built): rows above and below the glyphs read only the kernel rows that
// reach ink. Blocks inside the stroke mostly fill up after a few terms; the
// kernel splits the rest into smaller blocks, so that along the stroke's
// ends only the few pixels short of 255 read on. Those pixels (the outer
// edge, and beyond it wherever ink rows are within reach) still read every
// term of their row, so there the cost grows with the radius: D full terms
// and about as many rim terms, two reads each. Only the part of the output
// that lands on a target is worked out.
//
// Every disc makeCircleKernel makes has that shape: distances only grow
// along a row, the float steps that turn them into bytes never reverse an
// order, and the odd centre is 255 from r = 1 on and, below that, equal to
// its row neighbours (r - 1 + 1 is exactly r) or alone (D = 1).

#include "effect/filters/GxStroke.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <new>

#include "effect/GxBlender.h"
#include "effect/filters/GxFilterLimits.h"
#include "effect/filters/GxLayerSupport.h"
#include "effect/filters/GxStrokeRows.h"

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

// --- chords

bool StrokeChords::plan(const unsigned char* k, int D) {
    D_ = 0;
    if (k == nullptr || D <= 0 || (D & 1) == 0 || D > kMaxKernelSize) return false;
    const int R = D >> 1;
    try {
        levels_.clear();
        rows_.assign(size_t(D), Row());
        int widest = 0;
        for (int ky = 0; ky < D; ++ky) {
            const unsigned char* row = k + size_t(ky) * D + R;  // the centre column
            for (int d = 1; d <= R; ++d)
                if (row[d] != row[-d] || row[d] > row[d - 1]) return false;
            rows_[size_t(ky)].first = int(levels_.size());
            for (int d = 0; d <= R && row[d] != 0; ++d) {
                if (d < R && row[d + 1] == row[d]) continue;  // the run goes on
                int span = 0;
                while ((2 << span) <= 2 * d + 1) ++span;
                levels_.push_back(Level{-d, d - (1 << span) + 1, span, uint8_t(255 - row[d])});
                widest = d > widest ? d : widest;
            }
            rows_[size_t(ky)].count = int(levels_.size()) - rows_[size_t(ky)].first;
        }
        steps_.clear();
        auto full = [&](int ky) {
            const Row& r = rows_[size_t(ky)];
            if (r.count > 0 && levels_[size_t(r.first)].cut == 0) steps_.push_back(Step{ky, r.first});
        };
        full(R);
        for (int step = 1; step <= R; ++step) {
            full(R - step);
            full(R + step);
        }
        flatSteps_ = steps_.size();
        rimFrom_.assign(size_t(D) + 1, 0);
        for (int ky = 0; ky <= D; ++ky) {
            rimFrom_[size_t(ky)] = steps_.size();
            if (ky == D) break;
            for (int i = 0; i < rows_[size_t(ky)].count; ++i)
                if (levels_[size_t(rows_[size_t(ky)].first + i)].cut != 0)
                    steps_.push_back(Step{ky, rows_[size_t(ky)].first + i});
        }
        widest_ = widest;
        spans_ = 1;
        while ((2 << (spans_ - 1)) <= 2 * widest + 1) ++spans_;
    } catch (...) {
        return false;
    }
    R_ = R;
    D_ = D;
    return true;
}

namespace {

// Geometry of one spread: the framed source, and its rows inside the span
// tables with `reach` zeros on either side (every run of every output column
// stays inside them).
struct SpreadGeometry {
    int width, height;  // the framed source
    int reach;          // R + widest
    size_t pitch;       // bytes per span table row
    size_t table;       // bytes per span table
    size_t terms;       // bytes of the term list, its templates and the ink flags, a multiple of 64
};

bool Geometry(int w, int h, int frame, int R, int widest, int spans, size_t levels, SpreadGeometry* g) {
    if (w <= 0 || h <= 0 || frame < 0) return false;
    const int64_t width = int64_t(w) + 2 * int64_t(frame);
    const int64_t height = int64_t(h) + 2 * int64_t(frame);
    const int64_t pitch = width + 2 * (int64_t(R) + widest);
    size_t table = 0, all = 0;
    if (pitch > INT32_MAX || height > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(pitch), unsigned(height), 1, &table) ||
        !GxBitmap::PixelBytes(unsigned(pitch), unsigned(height), unsigned(spans), &all))
        return false;
    g->width = int(width);
    g->height = int(height);
    g->reach = R + widest;
    g->pitch = size_t(pitch);
    g->table = table;
    g->terms = (levels * (2 * sizeof(StrokeRows::Term) + sizeof(int)) + size_t(height) + 63) / 64 * 64;
    return true;
}

// Whether the n bytes from p are all 0.
bool AllZero(const unsigned char* p, size_t n) {
    return n == 0 || (p[0] == 0 && std::memcmp(p, p + 1, n - 1) == 0);
}

// The part of a w x h plane placed at (x, y) that lands on `dst` or on
// `extra` (when given): the bounding box of both, in plane coordinates.
bool VisiblePart(int x, int y, int w, int h, const GxBitmap* dst, const GxBitmap* extra,
                 StrokeChords::Window* window) {
    int64_t left = INT64_MAX, top = INT64_MAX, right = INT64_MIN, bottom = INT64_MIN;
    for (const GxBitmap* target : {dst, extra}) {
        if (target == nullptr || target->pixels == nullptr) continue;
        const int64_t l = std::max<int64_t>(0, -int64_t(x)), t = std::max<int64_t>(0, -int64_t(y));
        const int64_t r = std::min<int64_t>(w, int64_t(target->width) - x);
        const int64_t b = std::min<int64_t>(h, int64_t(target->height) - y);
        if (l >= r || t >= b) continue;
        left = std::min(left, l);
        top = std::min(top, t);
        right = std::max(right, r);
        bottom = std::max(bottom, b);
    }
    if (left >= right || top >= bottom) return false;
    *window = StrokeChords::Window{int(left), int(top), int(right - left), int(bottom - top)};
    return true;
}

}  // namespace

bool StrokeChords::workBytes(int w, int h, int frame, size_t* bytes) const {
    SpreadGeometry g;
    if (!planned() || !Geometry(w, h, frame, R_, widest_, spans_, levels_.size(), &g)) return false;
    *bytes = g.terms + g.table * size_t(spans_);
    return true;
}

void StrokeChords::spread(const unsigned char* source, int stride, int w, int h, int frame, bool inverse,
                          unsigned char* work, const Window& window, unsigned char* out, size_t outStride) const {
    SpreadGeometry g;
    if (!planned() || source == nullptr || work == nullptr || out == nullptr ||
        !Geometry(w, h, frame, R_, widest_, spans_, levels_.size(), &g))
        return;
    const int outWidth = g.width + D_ - 1, outHeight = g.height + D_ - 1;
    if (window.left < 0 || window.top < 0 || window.width <= 0 || window.height <= 0 ||
        window.left > outWidth - window.width || window.top > outHeight - window.height)
        return;
    const StrokeRows::Table& rows = StrokeRows::Active();
    // The row's terms; every step's term for source row 0 and its kernel
    // row; ink[y]: whether table row y holds a non-zero sample.
    const size_t steps = steps_.size();
    auto* terms = reinterpret_cast<StrokeRows::Term*>(work);
    StrokeRows::Term* templates = terms + steps;
    auto* kernelRows = reinterpret_cast<int*>(templates + steps);
    unsigned char* ink = reinterpret_cast<unsigned char*>(kernelRows + steps);
    unsigned char* tables = work + g.terms;

    // The source rows the window reads.
    const int firstRow = window.top - (D_ - 1) > 0 ? window.top - (D_ - 1) : 0;
    const int endRow = window.top + window.height < g.height ? window.top + window.height : g.height;

    // Span table 0: the framed source (or its inverse) between zeros.
    const unsigned char frameValue = inverse ? 255 : 0;
    for (int y = firstRow; y < endRow; ++y) {
        unsigned char* row = tables + size_t(y) * g.pitch;
        std::memset(row, 0, size_t(g.reach));
        unsigned char* framed = row + g.reach;
        const int sy = y - frame;
        if (sy < 0 || sy >= h) {
            std::memset(framed, frameValue, size_t(g.width));
        } else {
            std::memset(framed, frameValue, size_t(frame));
            const unsigned char* from = source + size_t(sy) * size_t(stride);
            unsigned char* to = framed + frame;
            if (inverse) {
                for (int x = 0; x < w; ++x) to[x] = uint8_t(255 - from[x]);
            } else {
                std::memcpy(to, from, size_t(w));
            }
            std::memset(to + w, frameValue, size_t(frame));
        }
        std::memset(framed + g.width, 0, size_t(g.reach));
        ink[y] = !AllZero(framed, size_t(g.width));
    }
    // Table j from table j - 1: the larger of two neighbouring spans. Runs
    // only read spans that end inside the row.
    for (int j = 1; j < spans_; ++j) {
        const unsigned char* below = tables + size_t(j - 1) * g.table;
        unsigned char* table = tables + size_t(j) * g.table;
        const int n = int(g.pitch) - (1 << j) + 1;
        for (int y = firstRow; y < endRow; ++y) {
            if (!ink[y]) continue;  // no term reads it
            const size_t at = size_t(y) * g.pitch;
            rows.maxRow(below + at, below + at + (1 << (j - 1)), n, table + at);
        }
    }

    // One output row at a time, the steps whose kernel row reaches a source
    // row with ink. Output column `window.left` centres on source column
    // window.left - R.
    for (size_t i = 0; i < steps; ++i) {
        const Level& level = levels_[size_t(steps_[i].level)];
        const unsigned char* centre = tables + size_t(level.span) * g.table + size_t(g.reach - R_ + window.left);
        templates[i] = StrokeRows::Term{centre + level.left, centre + level.right, level.cut};
        kernelRows[i] = steps_[i].ky;
    }
    for (int y = window.top; y < window.top + window.height; ++y) {
        // Kernel row ky reaches source row y - ky; a row of zeros proposes
        // nothing, so its terms are left out.
        auto take = [&](size_t from, size_t to, int count) {
            for (size_t i = from; i < to; ++i) {
                const int sy = y - kernelRows[i];
                if (unsigned(sy) >= unsigned(g.height) || !ink[sy]) continue;
                const size_t offset = size_t(sy) * g.pitch;
                terms[count++] = StrokeRows::Term{templates[i].a + offset, templates[i].b + offset, templates[i].cut};
            }
            return count;
        };
        const int flat = take(0, flatSteps_, 0);
        const int kyFirst = y - (g.height - 1) > 0 ? y - (g.height - 1) : 0;
        const int kyEnd = y + 1 < D_ ? y + 1 : D_;
        const int count = take(rimFrom_[size_t(kyFirst)], rimFrom_[size_t(kyEnd)], flat);
        rows.dilateRow(terms, flat, count, window.width, out + size_t(y - window.top) * outStride);
    }
}

// --- the layer

bool GxStroke::prepare(float radius) {
    if (prepared && radius == plannedRadius) return chords.planned();
    prepared = false;
    unsigned char* raw = nullptr;
    const int D = makeCircleKernel(&raw, radius);
    WorkBuffer<unsigned char> kernel(raw);
    if (!kernel || !chords.plan(kernel.get(), D)) return false;
    plannedRadius = radius;
    prepared = true;
    return true;
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
    // Every disc makeCircleKernel makes is chords; the check is a guard.
    if (!prepare(radius)) return;
    const int R = chords.kernelSize() >> 1;

    // The text rectangle inside a one-pixel frame of zeros; the output is
    // that grown by R on every side (two planes in centre mode).
    const int textW = rect.right - rect.left, textH = rect.bottom - rect.top;
    const int64_t Wo = int64_t(textW) + 2 + 2 * R;
    const int64_t Ho = int64_t(textH) + 2 + 2 * R;
    const unsigned planes = position == 0 ? 2 : 1;
    size_t outBytes = 0;
    if (Wo > INT32_MAX || Ho > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(Wo), unsigned(Ho), planes, &outBytes))
        return;
    const size_t planeSize = size_t(Wo) * size_t(Ho);

    size_t workBytes = 0;
    if (!chords.workBytes(textW, textH, 1, &workBytes)) return;
    // Work memory: the stack's when it lends it, else our own for this call.
    WorkBuffer<unsigned char> ownOutput, ownWork;
    unsigned char* output = nullptr;
    unsigned char* work = nullptr;
    if (p->scratch != nullptr) {
        output = p->scratch->get<unsigned char>(GxScratch::kPlaneB, outBytes);
        work = p->scratch->get<unsigned char>(GxScratch::kPlaneA, workBytes);
    } else {
        ownOutput = AllocateWork<unsigned char>(outBytes);
        ownWork = AllocateWork<unsigned char>(workBytes);
        output = ownOutput.get();
        work = ownWork.get();
    }
    if (output == nullptr || work == nullptr) return;
    // Only what lands on a target is worked out.
    const int x = rect.left - 1 - R;
    const int y = rect.top - 1 - R;
    StrokeChords::Window window;
    if (!VisiblePart(x, y, int(Wo), int(Ho), p->dst, p->extraDst, &window)) return;
    const unsigned char* corner = src.pixels + size_t(rect.top) * src.width + size_t(rect.left);
    const int stride = int(src.width);
    unsigned char* visible = output + size_t(window.top) * size_t(Wo) + size_t(window.left);
    chords.spread(corner, stride, textW, textH, 1, position != 0 && position != 1, work, window, visible,
                  size_t(Wo));
    if (position == 0) {
        unsigned char* inverse = visible + planeSize;
        chords.spread(corner, stride, textW, textH, 1, true, work, window, inverse, size_t(Wo));
        const StrokeRows::MinRow band = StrokeRows::Active().minRow;
        for (int row = 0; row < window.height; ++row)
            band(visible + size_t(row) * size_t(Wo), inverse + size_t(row) * size_t(Wo), window.width);
    }

    const int mode = (p->separateWorkImage == 1 || position != 0) ? GxE_BLEND_DST_OVER : GxE_BLEND_SRC_OVER;
    const int left = x + window.left, top = y + window.top;
    GxBlender::drawBitmapBlend8(left, top, p->dst, visible, window.width, window.height, int(Wo), property->color,
                                mode);
    if (p->extraDst != nullptr)
        GxBlender::drawBitmapBlend8(left, top, p->extraDst, visible, window.width, window.height, int(Wo),
                                    property->color, mode);
}

}  // namespace Glimmer
