#include "effect/filters/GxRelief.h"

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "effect/GxBlender.h"
#include "effect/filters/GxBlurRows.h"
#include "effect/filters/GxGaussian.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

constexpr float kFar = 1e20f;
// Longest square-root table built for a window, in entries (16 MB); beyond it
// roots are computed one by one.
constexpr int64_t kMaxOwnedRoots = int64_t(1) << 22;

struct FreeOnExit {
    void* pointer;
    ~FreeOnExit() { std::free(pointer); }
};

inline bool IsTarget(float v, GxReliefTargets targets) {
    return targets == GxReliefTargets::kNonZero ? v != 0.0f : v > 0.0f;
}

// The amount a source contributes before its root is added.
inline float SourceValue(float v, GxReliefTargets targets) {
    return targets == GxReliefTargets::kPositive && !(v > 0.0f) ? 0.0f : v;
}

inline int ClampRadius(int radius, int width, int height) {
    int largest = width > height ? width : height;
    return radius > largest ? largest : radius;
}

}  // namespace

bool ReliefSizePixels(float size, int* pixels) {
    if (size != size) {  // NaN: no size at all
        *pixels = 0;
        return true;
    }
    const float limit = float(kMaxFilterRadius + 1);
    if (!(size < limit && size > -limit)) return false;
    *pixels = int(size);  // toward zero: -1.5 is -1
    return true;
}

bool ReliefPlanFrame(const GxRect& textRect, int margin, GxReliefFrame* frame) {
    int64_t width = int64_t(textRect.right) - textRect.left + 2 * int64_t(margin);
    int64_t height = int64_t(textRect.bottom) - textRect.top + 2 * int64_t(margin);
    int64_t x0 = int64_t(textRect.left) - margin;
    int64_t y0 = int64_t(textRect.top) - margin;
    if (margin < 0 || width <= 0 || height <= 0 || width > INT32_MAX || height > INT32_MAX) return false;
    if (x0 < INT32_MIN || y0 < INT32_MIN) return false;
    size_t bytes = 0;
    if (!GxBitmap::PixelBytes(unsigned(width), unsigned(height), 4, &bytes)) return false;
    frame->x0 = int(x0);
    frame->y0 = int(y0);
    frame->width = int(width);
    frame->height = int(height);
    frame->margin = margin;
    frame->pixels = size_t(width) * size_t(height);
    return true;
}

// ---- blur

int ReliefPartialBlur(void* raw) {
    auto* job = static_cast<GxReliefBlurJob*>(raw);
    if (job == nullptr || job->src == nullptr || job->dst == nullptr || job->stride <= 0) return 0;
    const int radius = job->radius > 0 ? job->radius : 0;
    GxGaussian gaussian;  // keeps 255 * total weight well inside 32 bits
    if (!PlanGaussian(&gaussian, radius, kShadowGaussianCentre, GaussianRounding::kSingle)) return -1;
    const int x0 = job->x0 > 0 ? job->x0 : 0;
    const int x1 = job->x1 < job->stride ? job->x1 : job->stride;
    if (x0 >= x1 || job->y0 >= job->y1) return 0;
    const size_t stride = size_t(job->stride);

    // The row buffer has `radius` zero bytes before column 0 and after the last
    // column, so the horizontal pass never leaves it; inside the frame those are
    // the zeroed first and last `radius` bytes of a stride-long row. Columns
    // outside [x0, x1) are never written and stay 0.
    const size_t paddedBytes = stride + 2 * size_t(radius);
    unsigned char* padded = nullptr;
    FreeOnExit freePadded{nullptr};
    if (job->scratch != nullptr) {
        padded = job->scratch->get<unsigned char>(GxScratch::kRows, paddedBytes, true);
    } else {
        padded = static_cast<unsigned char*>(std::calloc(paddedBytes, 1));
        freePadded.pointer = padded;
    }
    if (padded == nullptr) return -1;
    unsigned char* row = padded + radius;
    const BlurRows::BlurRow blur = BlurRows::Active().blurRow;
    const int n = x1 - x0;

    for (int y = job->y0; y < job->y1; ++y) {
        const unsigned char* centre = job->src + ptrdiff_t(y) * ptrdiff_t(stride);
        blur(centre + x0, ptrdiff_t(stride), n, gaussian, false, row + x0);
        blur(row + x0, 1, n, gaussian, false, job->dst + ptrdiff_t(y) * ptrdiff_t(stride) + x0);
    }
    return 0;
}

int ReliefBlur(const unsigned char* src, unsigned char* dst, int stride, int radius, int height,
               GxScratch* scratch) {
    GxReliefBlurJob job{src, dst, stride, radius, radius, stride - radius, radius, height - radius, scratch};
    if (radius < 0) {  // a negative radius would name rows outside the plane
        job.x0 = job.y0 = 0;
        job.x1 = stride;
        job.y1 = height;
    }
    return ReliefPartialBlur(&job);
}

// ---- distance transforms

void ReliefDT1D(const float* f, float* d, int n, int* v, float* z) {
    if (n < 1) return;
    int k = 0;
    v[0] = 0;
    z[0] = -kFar;
    z[1] = kFar;
    for (int q = 1; q < n; ++q) {
        const float fq = f[q] + float(int64_t(q) * q);
        float s;
        for (;;) {
            const int vk = v[k];
            s = (fq - (f[vk] + float(int64_t(vk) * vk))) / float(2 * int64_t(q) - 2 * int64_t(vk));
            // z[0] = -1e20 stops the walk for every field of values 0..1e20; the
            // k > 0 test only keeps other inputs inside the arrays.
            if (k > 0 && s <= z[k]) {
                --k;
                continue;
            }
            break;
        }
        ++k;
        v[k] = q;
        z[k] = s;
        z[k + 1] = kFar;
    }
    k = 0;
    for (int p = 0; p < n; ++p) {
        while (z[k + 1] < float(p)) ++k;
        const int64_t dp = int64_t(p) - v[k];
        d[p] = f[v[k]] + float(dp * dp);
    }
}

void ReliefDT1D(const float* f, float* d, int n) {
    if (n < 1) return;
    int* v = static_cast<int*>(std::malloc(sizeof(int) * size_t(n)));
    FreeOnExit freeV{v};
    float* z = static_cast<float*>(std::malloc(sizeof(float) * (size_t(n) + 1)));
    FreeOnExit freeZ{z};
    if (v == nullptr || z == nullptr) return;
    ReliefDT1D(f, d, n, v, z);
}

bool ReliefExactTransform(float* field, int width, int height) {
    if (field == nullptr || width <= 0 || height <= 0) return true;
    const size_t n = size_t(width > height ? width : height);
    float* line = static_cast<float*>(std::malloc(sizeof(float) * n));
    FreeOnExit freeLine{line};
    float* out = static_cast<float*>(std::malloc(sizeof(float) * n));
    FreeOnExit freeOut{out};
    int* v = static_cast<int*>(std::malloc(sizeof(int) * n));
    FreeOnExit freeV{v};
    float* z = static_cast<float*>(std::malloc(sizeof(float) * (n + 1)));
    FreeOnExit freeZ{z};
    if (line == nullptr || out == nullptr || v == nullptr || z == nullptr) return false;

    const size_t stride = size_t(width);
    for (int x = 0; x < width; ++x) {
        for (int y = 0; y < height; ++y) line[y] = field[size_t(y) * stride + size_t(x)];
        ReliefDT1D(line, out, height, v, z);
        for (int y = 0; y < height; ++y) field[size_t(y) * stride + size_t(x)] = out[y];
    }
    for (int y = 0; y < height; ++y) {
        float* row = field + size_t(y) * stride;
        std::memcpy(line, row, sizeof(float) * stride);
        ReliefDT1D(line, row, width, v, z);
    }
    return true;
}

// ---- square roots

int64_t ReliefLargestRootIndex(int width, int height, int radius) {
    if (radius <= 0 || width <= 0 || height <= 0) return 0;
    int64_t dx = radius < width - 1 ? radius : width - 1;
    int64_t dy = radius < height - 1 ? radius : height - 1;
    return dx * dx + dy * dy;
}

GxReliefRoots::GxReliefRoots(int64_t largestIndex)
    : table_(GX_INT_SQRT_TABLE.data()), size_(kIntSqrtTableSize) {
    if (largestIndex < kIntSqrtTableSize || largestIndex >= kMaxOwnedRoots) return;
    const int64_t size = largestIndex + 1;
    owned_ = static_cast<float*>(std::malloc(sizeof(float) * size_t(size)));
    if (owned_ == nullptr) return;  // IntSqrt answers one index at a time instead
    std::memcpy(owned_, GX_INT_SQRT_TABLE.data(), sizeof(float) * kIntSqrtTableSize);
    // k = the nearest integer to 1000 sqrt(i), the largest k with
    // (2k - 1)^2 <= 4e6 i (as RoundedSqrt finds it), walked upward with i.
    uint64_t k = 0;
    for (int64_t i = 0; i < size; ++i) {
        const uint64_t target = uint64_t(4000000) * uint64_t(i);
        while ((2 * (k + 1) - 1) * (2 * (k + 1) - 1) <= target) ++k;
        if (i >= kIntSqrtTableSize) owned_[i] = float(double(k) / 1000.0);
    }
    table_ = owned_;
    size_ = size;
}

GxReliefRoots::~GxReliefRoots() { std::free(owned_); }

float GxReliefRoots::Slow(int64_t index) {
    if (index <= INT32_MAX) return IntSqrt(int(index));
    // No window of a frame the library allocates gets here.
    return float(std::round(std::sqrt(double(index)) * 1000.0) / 1000.0);
}

// ---- local distance search

void ReliefLocalDistanceReference(float* field, int width, int height, int radius, int y0, int y1,
                                  GxReliefTargets targets) {
    if (field == nullptr || width <= 0 || height <= 0) return;
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    const int r = ClampRadius(radius, width, height);
    if (y0 >= y1 || r < 0) return;
    GxReliefRoots roots(ReliefLargestRootIndex(width, height, r));
    const size_t stride = size_t(width);
    for (int y = y0; y < y1; ++y) {
        for (int x = 0; x < width; ++x) {
            float cur = field[size_t(y) * stride + size_t(x)];
            if (!IsTarget(cur, targets)) continue;
            const int yyEnd = y + r + 1 < height ? y + r + 1 : height;
            const int xxEnd = x + r + 1 < width ? x + r + 1 : width;
            for (int yy = y - r > 0 ? y - r : 0; yy < yyEnd; ++yy) {
                for (int xx = x - r > 0 ? x - r : 0; xx < xxEnd; ++xx) {
                    const float v = field[size_t(yy) * stride + size_t(xx)];
                    if (!(v < 1.0f)) continue;
                    const int64_t dy = yy - y;
                    const int64_t dx = xx - x;
                    const float root = roots[dy * dy + dx * dx];
                    const float candidate =
                        targets == GxReliefTargets::kPositive && !(v > 0.0f) ? root : v + root;
                    if (candidate < cur) {
                        cur = candidate;
                        field[size_t(y) * stride + size_t(x)] = cur;
                    }
                }
            }
        }
    }
}

// The search. Sources (values below 1.0) never change: a candidate is a
// non-negative amount plus a root of at least 1.0, so no improvement makes a
// new source, and a source's own window cannot improve it. That allows:
//   - a summed-area table of source counts, so a window without sources is
//     passed over at once, and each row's sources are found by column;
//   - nearest-first search: rows at dy = 0, 1, 2 ... and, in each row, the
//     sources to the right and to the left of the target outward. Every
//     candidate is at least the root of its distance (roots grow with the
//     distance, the added amount is >= 0), so a direction stops as soon as its
//     root alone is no better than the best found.
// The minimum found is the minimum the literal scan reaches: equal candidates
// never replace one another there either.
int ReliefLocalDistance(float* field, int width, int height, int radius, int y0, int y1,
                        GxReliefTargets targets) {
    if (field == nullptr || width <= 0 || height <= 0) return 0;
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    const int r = ClampRadius(radius, width, height);
    // A window of the pixel alone never improves it.
    if (y0 >= y1 || r <= 0) return 0;

    const int rowsBegin = y0 - r > 0 ? y0 - r : 0;
    const int rowsEnd = int64_t(y1) + r < height ? y1 + r : height;
    const size_t rows = size_t(rowsEnd - rowsBegin);
    const size_t satStride = size_t(width) + 1;
    const size_t stride = size_t(width);

    // sat[j][x]: sources in rows [rowsBegin, rowsBegin + j), columns [0, x).
    auto* sat = static_cast<uint32_t*>(std::calloc((rows + 1) * satStride, sizeof(uint32_t)));
    FreeOnExit freeSat{sat};
    if (sat == nullptr) {
        ReliefLocalDistanceReference(field, width, height, radius, y0, y1, targets);
        return 0;
    }
    for (size_t j = 0; j < rows; ++j) {
        const float* row = field + (rowsBegin + j) * stride;
        const uint32_t* above = sat + j * satStride;
        uint32_t* here = sat + (j + 1) * satStride;
        uint32_t run = 0;
        for (int x = 0; x < width; ++x) {
            const float v = row[x];
            if (v < 1.0f) {
                // A negative amount would break the nearest-first bound.
                if (targets == GxReliefTargets::kNonZero && v < 0.0f) {
                    ReliefLocalDistanceReference(field, width, height, radius, y0, y1, targets);
                    return 0;
                }
                ++run;
            }
            here[x + 1] = above[x + 1] + run;
        }
    }
    const size_t sourceCount = sat[rows * satStride + stride];
    if (sourceCount == 0) return 0;

    int* columns = static_cast<int*>(std::malloc(sizeof(int) * sourceCount));
    FreeOnExit freeColumns{columns};
    float* amounts = static_cast<float*>(std::malloc(sizeof(float) * sourceCount));
    FreeOnExit freeAmounts{amounts};
    if (columns == nullptr || amounts == nullptr) {
        ReliefLocalDistanceReference(field, width, height, radius, y0, y1, targets);
        return 0;
    }
    size_t n = 0;
    for (size_t j = 0; j < rows; ++j) {
        const float* row = field + (rowsBegin + j) * stride;
        for (int x = 0; x < width; ++x) {
            if (row[x] < 1.0f) {
                columns[n] = x;
                amounts[n] = SourceValue(row[x], targets);
                ++n;
            }
        }
    }

    GxReliefRoots roots(ReliefLargestRootIndex(width, height, r));
    auto at = [&](int localRow, int x) { return sat[size_t(localRow) * satStride + size_t(x)]; };

    for (int y = y0; y < y1; ++y) {
        float* out = field + size_t(y) * stride;
        const int windowTop = (y - r > 0 ? y - r : 0) - rowsBegin;
        const int windowBottom = (int64_t(y) + r + 1 < height ? y + r + 1 : height) - rowsBegin;
        for (int x = 0; x < width; ++x) {
            const float cur = out[x];
            if (!IsTarget(cur, targets)) continue;
            const int left = x - r > 0 ? x - r : 0;
            const int right = int64_t(x) + r + 1 < width ? x + r + 1 : width;
            const uint32_t inWindow = at(windowBottom, right) - at(windowTop, right) -
                                      at(windowBottom, left) + at(windowTop, left);
            if (inWindow == 0) continue;

            float best = cur;
            const int localY = y - rowsBegin;
            for (int a = 0; a <= r; ++a) {
                const int64_t a2 = int64_t(a) * a;
                if (!(roots[a2] < best)) break;
                const bool aboveIn = localY - a >= windowTop;
                const bool belowIn = localY + a < windowBottom;
                if (!aboveIn && !belowIn) break;
                for (int side = 0; side < (a == 0 ? 1 : 2); ++side) {
                    const int j = side == 0 ? localY - a : localY + a;
                    if (side == 0 ? !aboveIn : !belowIn) continue;
                    const size_t begin = at(j, width);
                    const size_t end = at(j + 1, width);
                    const size_t split = begin + (at(j + 1, x) - at(j, x));
                    for (size_t k = split; k < end; ++k) {
                        const int64_t dx = columns[k] - x;
                        if (dx > r) break;
                        const float root = roots[a2 + dx * dx];
                        if (!(root < best)) break;
                        const float candidate = amounts[k] + root;
                        if (candidate < best) best = candidate;
                    }
                    for (size_t k = split; k-- > begin;) {
                        const int64_t dx = x - columns[k];
                        if (dx > r) break;
                        const float root = roots[a2 + dx * dx];
                        if (!(root < best)) break;
                        const float candidate = amounts[k] + root;
                        if (candidate < best) best = candidate;
                    }
                }
            }
            out[x] = best;
        }
    }
    return 0;
}

// ---- light

GxReliefLight ReliefLightVector(float angle, float altitude, int direction) {
    const float t = (180.0f - angle) * 3.14159f / 180.0f;
    const float a = altitude * 3.14159f / 180.0f;
    const float cosA = std::cos(a);
    GxReliefLight light;
    light.x = std::cos(t) * cosA;
    light.y = std::sin(t) * cosA;
    if (direction == 0) {
        light.x = -light.x;
        light.y = -light.y;
    }
    light.z = std::sin(a);
    return light;
}

float ReliefIncidence(const GxReliefLight& light, float normalZ, float gx, float gy) {
    const float towards = normalZ * light.z - light.x * gx - light.y * gy;
    const float length = fsqrt(normalZ * normalZ + gx * gx + gy * gy);
    return towards / length;
}

// ---- colouring

void ReliefColourise(const unsigned char* first, const unsigned char* second, size_t count,
                     float gain, uint32_t firstColour, uint32_t secondColour, uint32_t* out) {
    for (size_t i = 0; i < count; ++i) {
        const GxReliefTone tone = ReliefTone(first[i], second[i], gain);
        const int alpha = tone.difference > 255 ? 255 : tone.difference;
        out[i] = ReliefTint(tone.first ? firstColour : secondColour, alpha);
    }
}

// ---- planes

GxReliefPlanes::~GxReliefPlanes() {
    std::free(second);
    std::free(first);
}

bool GxReliefPlanes::Allocate(size_t pixels) {
    second = static_cast<unsigned char*>(std::calloc(pixels, 1));
    first = static_cast<unsigned char*>(std::calloc(pixels, 1));
    return second != nullptr && first != nullptr;
}

bool ReliefSmoothAndSoften(GxReliefPlanes* planes, int width, int height, bool smooth,
                           int smoothRadius, int soften) {
    const size_t pixels = size_t(width) * size_t(height);
    unsigned char* scratch = nullptr;
    if (smooth) {
        if (smoothRadius < 0) return false;  // its region would leave the planes
        auto* third = static_cast<unsigned char*>(std::calloc(pixels, 1));
        if (third == nullptr) return false;
        bool ok = ReliefBlur(planes->second, third, width, smoothRadius, height) == 0 &&
                  ReliefBlur(planes->first, planes->second, width, smoothRadius, height) == 0;
        scratch = planes->first;  // still the unblurred first wash
        planes->first = planes->second;
        planes->second = third;
        if (!ok) {
            std::free(scratch);
            return false;
        }
    }
    if (soften >= 1) {
        if (scratch == nullptr) {
            scratch = static_cast<unsigned char*>(std::calloc(pixels, 1));
            if (scratch == nullptr) return false;
        }
        bool ok = ReliefBlur(planes->second, scratch, width, soften, height) == 0 &&
                  ReliefBlur(planes->first, planes->second, width, soften, height) == 0;
        unsigned char* spent = planes->first;
        planes->first = planes->second;
        planes->second = scratch;
        std::free(spent);
        return ok;
    }
    std::free(scratch);
    return true;
}

// ---- drawing

void ReliefDrawFrame(const GxReliefVariant& variant, const GxReliefFrame& frame,
                     const uint32_t* argb, int separateWorkImage, GxBitmap* dst, GxBitmap* extra) {
    const int mode = separateWorkImage == 1 ? variant.modeWithWorkImage : variant.modeWithoutWorkImage;
    const auto* words = reinterpret_cast<const unsigned*>(argb);
    GxBlender::drawBitmapBlend32(frame.x0, frame.y0, dst, words, frame.width, frame.height, frame.width,
                                 mode);
    if (variant.drawsExtra && extra != nullptr) {
        GxBlender::drawBitmapBlend32(frame.x0, frame.y0, extra, words, frame.width, frame.height,
                                     frame.width, mode);
    }
}

}  // namespace Glimmer
