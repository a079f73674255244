#pragma once
// The stroke layer: an outline of the text, centred on the glyph edges,
// wholly outside them or wholly inside them. See GxStroke.cpp for how the
// band is grown.

#include <cstddef>
#include <cstdint>
#include <vector>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"

namespace Glimmer {

// One piece of the stroke's dilation work: spread the rows [rowBegin, rowEnd)
// of a region of `paddedMask` into the output plane(s) through `kernel`.
// Jobs over disjoint row ranges of one region write only their output planes
// and may run in parallel; together they give what one job over the whole
// region gives.
struct StrokeJob {
    unsigned char* outPlanes;   // output; in centre mode two planes, planeSize apart
    unsigned char* paddedMask;  // source mask (text mask inside a frame of zeros)
    unsigned char* kernel;      // kernelSize x kernelSize coverage of a disc
    int32_t srcStride;          // bytes per source row
    int32_t srcHeight;          // source rows
    int32_t srcTop;             // source row of region row 0
    int32_t srcLeft;            // source column of region column 0
    int32_t dstStride;          // bytes per output row
    int32_t dstHeight;          // output rows
    int32_t dstTop;             // output row of region row 0
    int32_t dstLeft;            // output column of region column 0
    int32_t planeSize;          // bytes in one output plane
    int32_t radius;             // stroke radius, truncated (informative)
    int32_t kernelSize;         // D, odd
    int32_t width;              // region columns
    int32_t height;             // region rows; the jobs of one region share it, and together
                                // must cover all of them (see partalDTStroke*)
    int32_t rowBegin;           // first region row of this job
    int32_t rowEnd;             // one past its last row
};

// Anti-aliased disc of radius `radius`: a malloc'd D x D coverage array with
// D = 2 * trunc(radius + 0.5) + 1, stored through `out` (the caller frees it).
// Returns D. When the block cannot be had `*out` is left as it was; a radius
// the filters refuse (NaN, below -1.5, above kMaxFilterRadius) returns 0 and
// leaves `*out` alone too.
int makeCircleKernel(unsigned char** out, float radius);

// A disc kernel planned as chords (see GxStroke.cpp): each kernel row as
// nested centred runs, one per coverage level. The dilation it computes is
// byte for byte what stamping the kernel at every source pixel gives.
class StrokeChords {
public:
    // False (nothing planned) when a row of the D x D kernel is not
    // symmetric and non-increasing away from its centre column: such a
    // kernel is only stamped.
    bool plan(const unsigned char* kernel, int D);
    bool planned() const { return D_ > 0; }
    int kernelSize() const { return D_; }

    // Work memory spread() needs for a w x h source with a frame of `frame`
    // pixels; false when it does not fit the filters' limits.
    bool workBytes(int w, int h, int frame, size_t* bytes) const;
    // Part of the output plane: columns [left, left + width), rows [top, top + height).
    struct Window {
        int left, top, width, height;
    };
    // The dilation of the w x h source (rows `stride` bytes apart) inside a
    // frame of zeros `frame` pixels wide, or of that framed source's inverse.
    // Its plane is (w + 2 frame + D - 1) x (h + 2 frame + D - 1); the bytes of
    // `window` (which must lie on it) are written to `out`, rows `outStride`
    // apart. Samples outside the frame count as nothing.
    void spread(const unsigned char* source, int stride, int w, int h, int frame, bool inverse,
                unsigned char* work, const Window& window, unsigned char* out, size_t outStride) const;

private:
    // A run of columns centre - w .. centre + w, the larger of the spans of
    // 2^span samples from centre + left and from centre + right.
    struct Level {
        int left;     // -w
        int right;    // w - 2^span + 1
        int span;
        uint8_t cut;  // 255 - its coverage
    };
    struct Row {
        int first = 0;  // its levels, narrowest (strongest) first
        int count = 0;
    };
    int D_ = 0;
    int R_ = 0;
    int widest_ = 0;  // widest run of any level
    int spans_ = 0;   // span tables: 2^0 .. 2^(spans_ - 1)
    std::vector<Level> levels_;
    std::vector<Row> rows_;
    // The order terms are read in: every full level, its kernel row centre
    // first, then outward; then every rim level.
    struct Step {
        int ky;
        int level;
    };
    std::vector<Step> steps_;
    size_t flatSteps_ = 0;
    std::vector<size_t> rimFrom_;  // per kernel row (and D), its first rim step
};

class GxStroke : public GxECoreBase {
public:
    GxStroke();
    ~GxStroke() override;

    void setProperty(GxProperty* p) override;
    GxProperty* getProperty() override;
    // Margin on every side: outside size + 0.5, centre size / 2 + 0.5 (both
    // truncated), inside 0.
    int32_t getOffset() override;
    void doPostProcessing(GxECore::ParamPostProcessing* p) override;

    // Band functions over a StrokeJob; each returns null. They trust the job:
    // every neighbourhood they touch must lie inside the output plane(s);
    // a kernel larger than makeCircleKernel ever makes writes nothing. A
    // pixel whose neighbours within the region (width x height) would all
    // stamp at least as strongly writes only its centre cell, relying on
    // those neighbours' stamps; so the result is exact once every row of
    // the region has been through some job.
    // Centre: mask into plane 1, inverse into plane 2.
    static void* partalDTStrokeCenter(void* job);
    // Dilation of the mask.
    static void* partalDTStrokeOutside(void* job);
    // Dilation of the inverse mask.
    static void* partalDTStrokeInside(void* job);

private:
    // Plans the disc of `radius` unless it is the one planned last; false
    // when there is none.
    bool prepare(float radius);

    GxStrokeProperty* property = nullptr;
    bool prepared = false;
    float plannedRadius = 0.0f;
    StrokeChords chords;
};

}  // namespace Glimmer
