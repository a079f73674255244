#pragma once
// The machinery shared by the two relief layers, bevel and emboss.
//
// Both layers turn the glyph mask into a height field around the glyph edge,
// light it, and draw the lit and the shaded slopes as two colour washes. The
// pieces they have in common live here once; what differs between them is
// named in GxReliefVariant (and in the radii each layer plans for itself):
//
//   - ReliefPartialBlur: the separable integer Gaussian (centre weight 100,
//     weights rounded in single precision) over a rectangle of a byte plane,
//     vertical pass into a row buffer, horizontal pass into the destination,
//     both the shared row kernel of GxBlurRows; tiles of columns whose taps
//     all read one byte get it without the kernel.
//     It writes only its rectangle; the rest of the destination keeps what it
//     held, which the plane rotation below relies on.
//   - ReliefDT1D / ReliefExactTransform: the lower-envelope squared Euclidean
//     distance transform of a line, and of a whole field (columns first, then
//     rows), in single precision with integer squares. The line-by-line
//     literal form is kept as ReliefExactTransformReference; the transform in
//     use leaves out the steps that provably change no bit on the fields of 0
//     and far the layers build.
//   - ReliefLocalDistance / ReliefInwardDistance: the local searches used for
//     smaller reliefs (GxReliefSearch.cpp): every target pixel takes the best
//     candidate, a value plus or minus sqrt(dx^2 + dy^2) from the rounded
//     square-root table, over the source pixels of its square window. Their
//     literal scans are kept beside them as the references; they agree bit
//     for bit.
//   - the light vector, the slope's lighting level, the edge factor that fades
//     a wash out where the field reaches its range, the plane write
//     ((amount >> 8) + 1) * edge >> 8, and the premultiplied colouring that
//     keeps whichever wash is stronger; by the row, with vector kernels, in
//     GxReliefRows.
//   - ReliefSmoothAndSoften: the blur passes over both planes with their buffer
//     rotation. Each blur writes only its inner region, and the buffers are
//     reused in a fixed order, so the outer strips of a plane may keep values
//     of the other plane; that is the layers' established output and is kept.
//
// A render takes its memory from the stack's scratch when it has one (the
// field and then the frame's words in kPlaneA, the planes and the blurs'
// spare in kPlaneB, search planes in kPlaneC, rows and tables in kRows), so
// renders of a size drawn before allocate nothing.
//
// The deliberate differences between the layers stay explicit: the coverage
// divisor (254.99 bevel, 254.999 emboss), the depth floor of the normal (0.1,
// 0.2), the colouring gain of the smooth technique (1.83, 2.03), the blend mode
// chosen for the separate-work-image mode (reversed between them), and whether
// the result is also drawn into the stack's extra destination (emboss only).

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <new>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/GxScratch.h"
#include "effect/filters/GxFilterLimits.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer {

// The two washes of a relief. The lighting puts the "second" plane on the
// slopes that face the light and the "first" on the others, for the bevel and
// the emboss alike, so the second carries the record's highlight colour and
// the first its shadow colour.
inline uint32_t ReliefFirstColour(const GxBevelProperty& p) { return p.shadowColor; }
inline uint32_t ReliefSecondColour(const GxBevelProperty& p) { return p.highlightColor; }

struct GxReliefVariant {
    float coverageScale;     // edge fraction = mask byte / coverageScale
    float depthFloor;        // normalZ = 2.4 / max(depth, depthFloor)
    float smoothGain;        // colouring gain of the smooth technique; the hard one uses 1.0
    int modeWithWorkImage;   // blend mode when the stack runs a separate work image
    int modeWithoutWorkImage;
    bool drawsExtra;         // the result is also drawn into ParamPostProcessing::extraDst
};

inline constexpr GxReliefVariant kBevelVariant = {254.99f, 0.1f, 1.83f, 1, 2, false};
inline constexpr GxReliefVariant kEmbossVariant = {254.999f, 0.2f, 2.03f, 2, 1, true};

// The property record already clamps soften to this; the filters re-check it
// because their margins and blur regions are built from it.
inline constexpr int kReliefMaxSoften = 16;

// int(size) for the radii, truncated toward zero (negative sizes stay
// negative; NaN acts as 0); false when its magnitude exceeds kMaxFilterRadius
// (GxFilterLimits.h): such a relief draws nothing and asks for no margin.
bool ReliefSizePixels(float size, int* pixels);
inline int ReliefSoften(int soften) {
    return soften < 0 ? 0 : (soften > kReliefMaxSoften ? kReliefMaxSoften : soften);
}

// ---- frame

// The private working frame: the text rectangle grown by `margin` on every
// side. false when it is empty or larger than the library allocates.
struct GxReliefFrame {
    int x0 = 0;  // mask coordinates of frame pixel (0, 0)
    int y0 = 0;
    int width = 0;
    int height = 0;
    int margin = 0;
    size_t pixels = 0;  // width * height
};
bool ReliefPlanFrame(const GxRect& textRect, int margin, GxReliefFrame* frame);

// The mask byte at (x, y), read as the packed buffer would be read: a column
// one past the right edge lands on the next row's first byte; anything outside
// the buffer reads 0.
inline unsigned ReliefMaskAt(const GxBitmap& mask, int64_t x, int64_t y) {
    if (x < 0 || y < 0) return 0;
    int64_t index = y * int64_t(mask.width) + x;
    if (index >= int64_t(mask.width) * int64_t(mask.height)) return 0;
    return mask.pixels[index];
}

// The mask bytes at (x, y) .. (x + count - 1, y) as ReliefMaskAt reads them,
// into out.
void ReliefMaskRow(const GxBitmap& mask, int64_t x, int64_t y, int count, unsigned char* out);

// Memory for one render: a slot of the stack's scratch when there is one
// (nothing allocated once the slot has grown), else the heap, freed with the
// buffer. Each get() may replace what an earlier one returned.
class GxReliefBuffer {
public:
    GxReliefBuffer(GxScratch* scratch, GxScratch::Slot slot) : scratch_(scratch), slot_(slot) {}
    ~GxReliefBuffer() { std::free(owned_); }
    GxReliefBuffer(const GxReliefBuffer&) = delete;
    GxReliefBuffer& operator=(const GxReliefBuffer&) = delete;

    // count T, or null when they cannot be had.
    template <typename T>
    T* get(size_t count) {
        if (count > (SIZE_MAX - 64) / sizeof(T)) return nullptr;
        return static_cast<T*>(bytes(count * sizeof(T)));
    }

private:
    void* bytes(size_t n);
    GxScratch* scratch_;
    GxScratch::Slot slot_;
    void* owned_ = nullptr;
    size_t ownedBytes_ = 0;
};

// ---- blur

// Blur job: a rectangle [x0, x1) x [y0, y1) of byte planes `stride` bytes
// wide. The caller keeps rows y0 - radius .. y1 + radius - 1 inside `src`.
// With `scratch` the row buffer comes from its kRows slot.
struct GxReliefBlurJob {
    const unsigned char* src;
    unsigned char* dst;
    int stride;
    int radius;
    int x0, x1;
    int y0, y1;
    GxScratch* scratch = nullptr;
};

// 0 when done; -1 (nothing written) when its scratch could not be had.
int ReliefPartialBlur(void* job);
// One job over [radius, stride - radius) x [radius, height - radius).
int ReliefBlur(const unsigned char* src, unsigned char* dst, int stride, int radius, int height,
               GxScratch* scratch = nullptr);

// ---- distance transforms

// d[p] = min over q of f[q] + (p - q)^2. f and d must not overlap. n < 1 does
// nothing, as does a failed scratch allocation.
void ReliefDT1D(const float* f, float* d, int n);
// The same with caller scratch: v holds n ints, z n + 1 floats.
void ReliefDT1D(const float* f, float* d, int n, int* v, float* z);
// The transform down every column, then along every row, in place. false
// (field untouched or half done) when scratch could not be had. With
// `scratch` its buffers come from the kRows slot.
bool ReliefExactTransform(float* field, int width, int height, GxScratch* scratch = nullptr);
// The same, line by line through ReliefDT1D: what the above must give.
bool ReliefExactTransformReference(float* field, int width, int height);
// The transform wherever it is at most reach^2, bit for bit; elsewhere some
// value above reach^2. For the layers, which need no more.
bool ReliefExactTransformNear(float* field, int width, int height, int reach, GxScratch* scratch = nullptr);

// What counts as a pixel to improve in the local search.
enum class GxReliefTargets {
    kNonZero,   // bevel: every value other than 0; candidate v + root
    kPositive,  // emboss outward pass: values above 0; candidate max(v, 0) + root
};

// The local search over rows [y0, y1) of a width x height field, window
// radius `radius` (GxReliefSearch.cpp tells how). With `scratch` its tables
// come from the kRows and kPlaneC slots. Returns 0 (every outcome).
int ReliefLocalDistance(float* field, int width, int height, int radius, int y0, int y1,
                        GxReliefTargets targets, GxScratch* scratch = nullptr);
// The literal scan, rows outer and columns inner in increasing order, each
// improvement stored at once: what the search above must give. It also
// serves it where its shortcuts do not hold (a negative source for kNonZero).
void ReliefLocalDistanceReference(float* field, int width, int height, int radius, int y0, int y1,
                                  GxReliefTargets targets);

// The emboss's inward pass over rows [y0, y1): every pixel below 0 takes the
// largest v - sqrt(dx^2 + dy^2) over the pixels above 1.0 in its window of
// `radius` (radius clamped to the larger side; negative: nothing). With
// `scratch` its planes and tables come from the kPlaneC and kRows slots.
void ReliefInwardDistance(float* field, int width, int height, int radius, int y0, int y1,
                          GxScratch* scratch = nullptr);
// Its literal scan, rows outer and columns inner, each improvement stored at once.
void ReliefInwardDistanceReference(float* field, int width, int height, int radius, int y0, int y1);

// sqrt(i) as the rounded table holds it, for every index a window can reach
// (beyond the stored table too). Falls back to IntSqrt when a longer table
// cannot be had.
class GxReliefRoots {
public:
    explicit GxReliefRoots(int64_t largestIndex);
    ~GxReliefRoots();
    GxReliefRoots(const GxReliefRoots&) = delete;
    GxReliefRoots& operator=(const GxReliefRoots&) = delete;

    float operator[](int64_t index) const { return index < size_ ? table_[index] : Slow(index); }

private:
    static float Slow(int64_t index);
    const float* table_;
    float* owned_ = nullptr;
    int64_t size_;
};

// The largest dx^2 + dy^2 a window of `radius` reaches inside a field.
int64_t ReliefLargestRootIndex(int width, int height, int radius);

// ---- light

struct GxReliefLight {
    float x = 0.0f;
    float y = 0.0f;
    float z = 0.0f;
};

// t = (180 - angle) * 3.14159 / 180, a = altitude * 3.14159 / 180 (3.14159 is
// deliberately short of pi); x = cos t cos a, y = sin t cos a, both negated
// when direction is 0 (light from below); z = sin a.
GxReliefLight ReliefLightVector(float angle, float altitude, int direction);

// 2.4 / max(depth, floor): a deeper relief has a flatter normal. NaN takes the floor.
inline float ReliefNormalZ(float depth, float floor) { return 2.4f / (depth > floor ? depth : floor); }

// Cosine-like lighting term of a slope (gx, gy) under `light`.
float ReliefIncidence(const GxReliefLight& light, float normalZ, float gx, float gy);

// The incidence at height-field pixel `d` from its central differences, each
// scaled by `half` (0.5f for a rising height, -0.5f for a descending one).
inline float ReliefSlopeIncidence(const GxReliefLight& light, float normalZ, const float* d,
                                  ptrdiff_t stride, float half) {
    const float gx = (d[-1] - d[1]) * half;
    const float gy = (d[-stride] - d[stride]) * half;
    return ReliefIncidence(light, normalZ, gx, gy);
}

// Clamped to at most 255, then to at least 0; NaN gives 0.
inline float ReliefClampLevel(float level) {
    if (level > 255.0f) level = 255.0f;
    if (!(level >= 0.0f)) level = 0.0f;
    return level;
}

// min(max(e, 0), 1) * 255 + 0.5, at most 255, truncated. NaN gives 0.
inline int ReliefEdgeFactor(float e) {
    if (!(e > 0.0f)) e = 0.0f;
    if (e > 1.0f) e = 1.0f;
    float scaled = e * 255.0f + 0.5f;
    if (scaled > 255.0f) scaled = 255.0f;
    return int(scaled);
}

// ((amount >> 8) + 1) * edge >> 8: 255 when the product reaches 65536, 0 when
// it is negative.
inline unsigned char ReliefPlaneValue(int amount, int edge) {
    int product = ((amount >> 8) + 1) * edge;
    if (product >= 65536) return 255;
    if (product < 0) return 0;
    return static_cast<unsigned char>(product >> 8);
}

// ---- colouring

// The colour `argb` premultiplied by `alpha`: alpha in the top byte, each of
// red, green, blue min(((channel + 1) * alpha) >> 8, 255).
inline uint32_t ReliefTint(uint32_t argb, int alpha) {
    uint32_t out = uint32_t(alpha) << 24;
    for (int shift = 16; shift >= 0; shift -= 8) {
        int channel = int((argb >> shift) & 0xFF);
        int v = ((channel + 1) * alpha) >> 8;
        out |= uint32_t(v > 255 ? 255 : v) << shift;
    }
    return out;
}

// The stronger of the two washes at one pixel: s = int(gain * first),
// l = int(gain * second); |s - l| (not yet limited) and whether the first
// colour wins (s > l strictly: a tie takes the second colour).
struct GxReliefTone {
    int difference;
    bool first;
};
inline GxReliefTone ReliefTone(unsigned firstValue, unsigned secondValue, float gain) {
    int s = int(gain * float(firstValue));
    int l = int(gain * float(secondValue));
    int d = s - l;
    return {d < 0 ? -d : d, s > l};
}

// One pixel per plane byte: min(|s - l|, 255) in the winning colour,
// premultiplied, as 0xAARRGGBB words.
void ReliefColourise(const unsigned char* first, const unsigned char* second, size_t count,
                     float gain, uint32_t firstColour, uint32_t secondColour, uint32_t* out);

// ---- planes

// The two wash planes of one lighting and the blurs' spare buffer, frame-
// sized. Which buffer holds which wash changes as the blurs rotate them.
struct GxReliefPlanes {
    GxReliefPlanes() = default;
    ~GxReliefPlanes();
    GxReliefPlanes(const GxReliefPlanes&) = delete;
    GxReliefPlanes& operator=(const GxReliefPlanes&) = delete;

    // Both planes zeroed, owned (freed on destruction); false when either
    // could not be had.
    bool Allocate(size_t pixels);
    // The caller's buffers, contents as they are; `spare` may be null.
    void Use(unsigned char* secondPlane, unsigned char* firstPlane, unsigned char* sparePlane);
    // A block freed on destruction (at most three), or null.
    unsigned char* Own(size_t pixels, bool zeroed);

    unsigned char* second = nullptr;
    unsigned char* first = nullptr;
    // What the blurs write into besides the planes; taken from the heap when
    // null. Holds no wash the caller needs.
    unsigned char* spare = nullptr;

private:
    unsigned char* owned_[3] = {};
};

// Smoothing (when `smooth`: the smooth technique, whatever its radius; a
// radius of 0 copies), then softening (soften >= 1), of both planes
// of a width x height frame:
//   smoothing: a fresh zeroed plane P; blur second -> P, first -> second's
//     buffer; then second = P, first = old second buffer, spare = old first
//     buffer (still holding the unblurred first wash).
//   softening: the spare after smoothing (as it is), else a fresh zeroed
//     plane S; blur second -> S, first -> second's buffer; then second = S,
//     first = second's buffer, spare = the remaining buffer.
// A blur writes only its inner region, so the outer strips show which buffer
// went where; that is the layers' established output. A "fresh zeroed" plane
// is the spare with the strips the blur leaves alone zeroed. With `scratch`
// the blurs' row buffer comes from its kRows slot.
// false when a plane or a blur's scratch could not be had, or the smoothing
// radius is negative (planes then hold an unspecified but valid state).
bool ReliefSmoothAndSoften(GxReliefPlanes* planes, int width, int height, bool smooth,
                           int smoothRadius, int soften, GxScratch* scratch = nullptr);

// ---- drawing

// Blends the frame's words into `dst` (and, for variants that draw extra,
// into `extra` when not null) at the frame's origin, with the variant's mode
// for `separateWorkImage`.
void ReliefDrawFrame(const GxReliefVariant& variant, const GxReliefFrame& frame,
                     const uint32_t* argb, int separateWorkImage, GxBitmap* dst, GxBitmap* extra);

// ---- the layer base

// What the bevel and the emboss layers share: the record they own (Record is
// GxBevelProperty or GxEmbossProperty) and the shared passes under the
// names both layers carry.
template <class Record>
class GxReliefLayer : public GxECoreBase {
public:
    using BlurJob = GxReliefBlurJob;

    ~GxReliefLayer() override { delete property; }

    // Keeps a fresh record of the layer's own type built through its
    // constructor, so its clamps and folds apply again; null and non-relief
    // records are ignored.
    void setProperty(GxProperty* p) override {
        if (p == nullptr) return;
        const auto* source = dynamic_cast<const GxBevelProperty*>(p);
        if (source == nullptr) return;
        auto* fresh = new (std::nothrow) Record(
            source->style, source->depth, source->size, source->direction, source->technique,
            source->soften, source->opacity, source->angle, source->altitude, source->highlightColor,
            source->highlightOpacity, source->shadowColor, source->shadowOpacity);
        delete property;
        property = fresh;
    }

    GxProperty* getProperty() override { return property; }

    static int blur(const unsigned char* src, unsigned char* dst, int stride, int radius, int height) {
        return ReliefBlur(src, dst, stride, radius, height);
    }
    static void dt1D(const float* f, float* d, int n) { ReliefDT1D(f, d, n); }
    // Work function: one GxReliefBlurJob, returns 0.
    static int partialBlur(void* job) { return ReliefPartialBlur(job); }

protected:
    Record* property = nullptr;
};

}  // namespace Glimmer
