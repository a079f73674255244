#include "effect/filters/GxRelief.h"

#include <bit>
#include <cmath>
#include <cstdlib>
#include <cstring>

#include "effect/GxBlender.h"
#include "effect/filters/GxBlurRows.h"
#include "effect/filters/GxGaussian.h"
#include "effect/filters/GxReliefRows.h"
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

void ReliefMaskRow(const GxBitmap& mask, int64_t x, int64_t y, int count, unsigned char* out) {
    // The packed buffer read as one line: indices y * width + x onward.
    const int64_t total = int64_t(mask.width) * int64_t(mask.height);
    int64_t begin = y * int64_t(mask.width) + x;
    int i = 0;
    if (y < 0 || mask.pixels == nullptr) {
        std::memset(out, 0, size_t(count > 0 ? count : 0));
        return;
    }
    for (; i < count && (x + i < 0); ++i) out[i] = 0;
    begin += i;
    if (i < count && begin < total) {
        const int64_t n = total - begin < int64_t(count - i) ? total - begin : int64_t(count - i);
        std::memcpy(out + i, mask.pixels + begin, size_t(n));
        i += int(n);
    }
    for (; i < count; ++i) out[i] = 0;
}

void* GxReliefBuffer::bytes(size_t n) {
    if (scratch_ != nullptr) return scratch_->get(slot_, n);
    if (owned_ != nullptr && n <= ownedBytes_) return owned_;
    std::free(owned_);
    owned_ = std::malloc(n ? n : 1);
    ownedBytes_ = owned_ != nullptr ? n : 0;
    return owned_;
}

// ---- blur

namespace {

// Columns per tile of the blur's constant test.
constexpr int kBlurTile = 32;
// A tile of mixed bytes.
constexpr int16_t kMixed = -1;

// The byte every one of p[0 .. n) holds, or kMixed.
int16_t UniformByte(const unsigned char* p, size_t n) {
    const uint64_t pattern = uint64_t(p[0]) * 0x0101010101010101ull;
    uint64_t differ = 0;
    size_t i = 0;
    for (; i + 8 <= n; i += 8) {
        uint64_t word;
        std::memcpy(&word, p + i, 8);
        differ |= word ^ pattern;
    }
    for (; i < n; ++i) differ |= p[i] ^ p[0];
    return differ == 0 ? int16_t(p[0]) : kMixed;
}

// Calls `run(begin, end, value)` for the maximal runs of tiles alike in
// `value` (a byte, or kMixed), as columns clipped to [x0, x1).
template <typename Run>
void ForEachRun(const int16_t* value, int tiles, int x0, int x1, Run run) {
    int t = x0 / kBlurTile;
    while (t < tiles && t * kBlurTile < x1) {
        int u = t + 1;
        while (u < tiles && u * kBlurTile < x1 && value[u] == value[t]) ++u;
        const int begin = t * kBlurTile > x0 ? t * kBlurTile : x0;
        const int end = u * kBlurTile < x1 ? u * kBlurTile : x1;
        run(begin, end, value[t]);
        t = u;
    }
}

}  // namespace

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
    //
    // Planes are mostly empty around the text and flat inside it (or flat
    // around it, inside a bevel). A blur of a constant is that constant (the
    // sum is c * S, divided by S), so a tile of columns whose every tap reads
    // the same byte gets it without the kernel: per source row, the byte each
    // tile holds throughout, if any; down the columns, how many rows in a row
    // held the same one (2R + 1 make the vertical pass constant); along the
    // row, whether every tile within R columns is that constant, and so is
    // the zero padding where the reach leaves [x0, x1).
    const int tiles = int((stride + kBlurTile - 1) / kBlurTile);
    const int firstRow = job->y0 - radius;
    const size_t paddedBytes = stride + 2 * size_t(radius);
    const size_t tileBytes = sizeof(int16_t) * size_t(tiles);
    const size_t countBytes = sizeof(int) * size_t(tiles);
    const size_t bytes = countBytes + 4 * tileBytes + paddedBytes;
    unsigned char* memory = nullptr;
    FreeOnExit freeMemory{nullptr};
    if (job->scratch != nullptr) {
        memory = job->scratch->get<unsigned char>(GxScratch::kRows, bytes, true);
    } else {
        memory = static_cast<unsigned char*>(std::calloc(bytes, 1));
        freeMemory.pointer = memory;
    }
    if (memory == nullptr) return -1;
    int* runs = reinterpret_cast<int*>(memory);  // aligned as the block is
    auto* entering = reinterpret_cast<int16_t*>(memory + countBytes);
    int16_t* held = entering + tiles;       // the value of each tile's run of rows
    int16_t* columns = held + tiles;        // the vertical pass's constant tiles
    int16_t* along = columns + tiles;       // the horizontal pass's
    unsigned char* row = memory + countBytes + 4 * tileBytes + radius;

    auto enter = [&](size_t j) {  // source row firstRow + j joins the window
        const unsigned char* line = job->src + (ptrdiff_t(firstRow) + ptrdiff_t(j)) * ptrdiff_t(stride);
        for (int t = 0; t < tiles; ++t) {
            const size_t from = size_t(t) * kBlurTile;
            const size_t n = stride - from < size_t(kBlurTile) ? stride - from : size_t(kBlurTile);
            const int16_t v = UniformByte(line + from, n);
            runs[t] = v == kMixed ? 0 : (v == held[t] ? runs[t] + 1 : 1);
            held[t] = v;
        }
    };
    for (int t = 0; t < tiles; ++t) held[t] = kMixed;
    for (size_t j = 0; j < size_t(2 * radius); ++j) enter(j);

    const BlurRows::BlurRow blur = BlurRows::Active().blurRow;
    const int reach = (radius + kBlurTile - 1) / kBlurTile;
    for (int y = job->y0; y < job->y1; ++y) {
        enter(size_t(y - job->y0) + 2 * size_t(radius));  // row y + R
        for (int t = 0; t < tiles; ++t) columns[t] = runs[t] >= 2 * radius + 1 ? held[t] : kMixed;
        const unsigned char* centre = job->src + ptrdiff_t(y) * ptrdiff_t(stride);
        ForEachRun(columns, tiles, x0, x1, [&](int begin, int end, int16_t value) {
            if (value == kMixed) {
                blur(centre + begin, ptrdiff_t(stride), end - begin, gaussian, false, row + begin);
            } else {
                std::memset(row + begin, value, size_t(end - begin));
            }
        });
        for (int t = 0; t < tiles; ++t) {
            // The taps of tile t: columns t * T - R .. (t + 1) * T - 1 + R.
            int16_t value = columns[t];
            const int64_t from = int64_t(t) * kBlurTile - radius;
            const int64_t to = int64_t(t + 1) * kBlurTile - 1 + radius;
            if (value > 0 && (from < x0 || to >= x1)) value = kMixed;  // reaches the zero padding
            for (int u = t - reach; u <= t + reach && value != kMixed; ++u)
                if (u >= 0 && u < tiles && columns[u] != value) value = kMixed;
            along[t] = value;
        }
        unsigned char* out = job->dst + ptrdiff_t(y) * ptrdiff_t(stride);
        ForEachRun(along, tiles, x0, x1, [&](int begin, int end, int16_t value) {
            if (value == kMixed) {
                blur(row + begin, 1, end - begin, gaussian, false, out + begin);
            } else {
                std::memset(out + begin, value, size_t(end - begin));
            }
        });
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

bool ReliefExactTransformReference(float* field, int width, int height) {
    if (field == nullptr || width <= 0 || height <= 0) return true;
    const size_t n = size_t(width > height ? width : height);
    float* line = static_cast<float*>(std::calloc(n, sizeof(float)));  // calloc: GCC 12 warns otherwise
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

namespace {

// Longest side of a field the fast transforms take (see below).
constexpr int kFastTransformSide = 4096;
constexpr int kNearTransformSide = 2048;

// ReliefDT1D over the entries other than kFar, their positions kept; a line
// of kFar alone gives kFar throughout.
void EnvelopeOfNear(const float* f, float* d, int n, int* v, float* z) {
    int k = -1;
    for (int q = 0; q < n; ++q) {
        if (f[q] == kFar) continue;
        const float fq = f[q] + float(int64_t(q) * q);
        if (k < 0) {
            k = 0;
            v[0] = q;
            z[0] = -kFar;
            z[1] = kFar;
            continue;
        }
        float s;
        for (;;) {
            const int vk = v[k];
            s = (fq - (f[vk] + float(int64_t(vk) * vk))) / float(2 * int64_t(q) - 2 * int64_t(vk));
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
    if (k < 0) {
        for (int p = 0; p < n; ++p) d[p] = kFar;
        return;
    }
    k = 0;
    for (int p = 0; p < n; ++p) {
        while (z[k + 1] < float(p)) ++k;
        const int64_t dp = int64_t(p) - v[k];
        d[p] = f[v[k]] + float(dp * dp);
    }
}

// A line of 0 and kFar only: the square of the distance to the nearest 0, or
// kFar when there is none.
void NearestZero(float* line, int n) {
    constexpr int kNone = 1 << 30;
    int last = -kNone;
    for (int p = 0; p < n; ++p) {
        if (line[p] == 0.0f) last = p;
        line[p] = float(p - last < kNone ? p - last : kNone);  // exact: below 2^24 or kNone
    }
    int next = kNone + n;
    for (int p = n - 1; p >= 0; --p) {
        if (line[p] == 0.0f) next = p;
        const int64_t up = int64_t(line[p]);
        const int64_t down = int64_t(next) - p;
        const int64_t nearest = up < down ? up : down;
        line[p] = nearest < n ? float(nearest * nearest) : kFar;
    }
}

}  // namespace

// The transform of the fields the layers build (every value 0 or kFar, sides
// up to 4096), with the literal's float arithmetic left out where it cannot
// change a bit:
//   - kFar entries never take part. Entering the envelope after a nearer
//     parabola a, kFar at q meets it at (1e20 - F_a) / 2(q - a), above every
//     position; the next nearer parabola meets kFar at a hugely negative point
//     and pops it (two kFar entries meet at 0 and the later pops the earlier),
//     leaving the walk where it stood without it; a kFar first entry is never
//     popped but loses every position to the first nearer one. So the outputs
//     are those of the envelope over the other entries (same operations),
//     and kFar + dp^2 is kFar for every dp below 2^21.
//   - A line of 0 and kFar: the parabolas q^2 (exact below 2^24) meet at
//     (q + q') / 2, exactly, never pop one another, and each position takes
//     its nearest zero (a tie, at a half-way point, takes either: same value).
//     So the output is the squared distance to the nearest zero, which two
//     sweeps give. Every column of the first pass is such a line, as is every
//     row of the second that holds only 0 and kFar.
// Other rows take the envelope without their kFar entries.
namespace {

// The column pass on a field of 0 and kFar: the squared distance to the
// nearest 0 of the column, kFar where it has none. `last` holds width ints.
void NearestZeroColumns(float* field, int width, int height, int* last) {
    // In 32-bit ints, the first pass keeping its distance in the float's bits
    // (a compare of bits and a select: that loop vectorises).
    const size_t stride = size_t(width);
    constexpr int kNone = 1 << 30;
    for (size_t x = 0; x < stride; ++x) last[x] = -kNone;
    for (int y = 0; y < height; ++y) {  // the distance to the last 0 above, at most kNone
        float* row = field + size_t(y) * stride;
        for (size_t x = 0; x < stride; ++x) {
            const int at = std::bit_cast<int32_t>(row[x]) == 0 ? y : last[x];
            last[x] = at;
            const int up = y - at;
            row[x] = std::bit_cast<float>(int32_t(up < kNone ? up : kNone));
        }
    }
    for (size_t x = 0; x < stride; ++x) last[x] = kNone + height;  // now: the next 0 below
    for (int y = height - 1; y >= 0; --y) {
        float* row = field + size_t(y) * stride;
        for (size_t x = 0; x < stride; ++x) {
            const int up = std::bit_cast<int32_t>(row[x]);
            const int at = up == 0 ? y : last[x];
            last[x] = at;
            const int down = at - y;
            const int nearest = up < down ? up : down;
            row[x] = nearest < height ? float(nearest * nearest) : kFar;
        }
    }
}

// Every value 0 (+0: the column pass reads its bits) or kFar.
bool ZeroOrFar(const float* values, size_t n) {
    bool all = true;
    for (size_t i = 0; i < n; ++i) all &= std::bit_cast<int32_t>(values[i]) == 0 || values[i] == kFar;
    return all;
}

}  // namespace

bool ReliefExactTransform(float* field, int width, int height, GxScratch* scratch) {
    if (field == nullptr || width <= 0 || height <= 0) return true;
    const size_t stride = size_t(width);
    if (width > kFastTransformSide || height > kFastTransformSide || !ZeroOrFar(field, stride * size_t(height)))
        return ReliefExactTransformReference(field, width, height);

    GxReliefBuffer memory(scratch, GxScratch::kRows);
    auto* words = memory.get<int32_t>(3 * stride + 1);
    if (words == nullptr) return false;
    int* v = words + stride;  // the envelope of a row
    auto* z = reinterpret_cast<float*>(words + 2 * stride);
    static_assert(sizeof(float) == sizeof(int32_t));
    NearestZeroColumns(field, width, height, words);
    auto* line = reinterpret_cast<float*>(words);  // the columns are done with it
    for (int y = 0; y < height; ++y) {
        float* row = field + size_t(y) * stride;
        if (ZeroOrFar(row, stride)) {
            NearestZero(row, width);
        } else {
            std::memcpy(line, row, sizeof(float) * stride);
            EnvelopeOfNear(line, row, width, v, z);
        }
    }
    return true;
}

// Within a reach. On rows of up to 2048 entries with values and squares below
// 2^24, the float envelope gives the true minimum min_q f[q] + (p - q)^2:
//   - each boundary s = (F_q - F_v) / 2(q - v) is the correctly rounded
//     quotient of exact integers (F = f + q^2 is exact), so rounding keeps
//     every order: where the exact walk pops a parabola, the float walk does
//     too, and consecutive boundaries kept are increasing in exact terms;
//   - an exact boundary N / D (D <= 4094) is an integer or at least
//     1 / 4094 > 2^-12 away from every integer, while rounding moves a value
//     below 2048 by at most 2^-14: no rounded boundary crosses an integer
//     position. So the final walk gives each position the parabola the exact
//     envelope gives it (at an exact tie either: same value), and a parabola
//     the float walk pops where the exact one would not is one whose exact
//     stretch, shorter than a rounding step, holds no position.
// So the second pass is the true minimum, and wherever that is at most
// reach^2 its minimising column lies within reach: the minimum over the
// 2 reach + 1 nearest columns. Elsewhere that minimum is larger than reach^2
// too (or kFar), which is all the layers ask of those pixels.
bool ReliefExactTransformNear(float* field, int width, int height, int reach, GxScratch* scratch) {
    if (field == nullptr || width <= 0 || height <= 0) return true;
    const size_t stride = size_t(width);
    if (width > kNearTransformSide || height > kNearTransformSide || reach < 0 || reach > kMaxFilterRadius ||
        !ZeroOrFar(field, stride * size_t(height))) {
        return ReliefExactTransform(field, width, height, scratch);
    }
    const size_t padded = stride + 2 * size_t(reach);
    GxReliefBuffer memory(scratch, GxScratch::kRows);
    auto* words = memory.get<int32_t>(stride + padded);
    if (words == nullptr) return false;
    NearestZeroColumns(field, width, height, words);
    auto* line = reinterpret_cast<float*>(words + stride);
    for (size_t i = 0; i < size_t(reach); ++i) line[i] = line[padded - 1 - i] = kFar;
    const ReliefRows::NearRow nearRow = ReliefRows::Active().nearRow;
    for (int y = 0; y < height; ++y) {
        float* row = field + size_t(y) * stride;
        std::memcpy(line + reach, row, sizeof(float) * stride);
        nearRow(line + reach, reach, width, row);
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
    const ReliefRows::ColouriseRow colourise = ReliefRows::Active().colourise;
    constexpr size_t kChunk = size_t(1) << 24;
    for (size_t i = 0; i < count; i += kChunk) {
        const size_t n = count - i < kChunk ? count - i : kChunk;
        colourise(first + i, second + i, int(n), gain, firstColour, secondColour, out + i);
    }
}

// ---- planes

GxReliefPlanes::~GxReliefPlanes() {
    for (unsigned char* block : owned_) std::free(block);
}

unsigned char* GxReliefPlanes::Own(size_t pixels, bool zeroed) {
    for (unsigned char*& block : owned_) {
        if (block != nullptr) continue;
        block = static_cast<unsigned char*>(zeroed ? std::calloc(pixels ? pixels : 1, 1)
                                                   : std::malloc(pixels ? pixels : 1));
        return block;
    }
    return nullptr;
}

bool GxReliefPlanes::Allocate(size_t pixels) {
    second = Own(pixels, true);
    first = Own(pixels, true);
    return second != nullptr && first != nullptr;
}

void GxReliefPlanes::Use(unsigned char* secondPlane, unsigned char* firstPlane, unsigned char* sparePlane) {
    second = secondPlane;
    first = firstPlane;
    spare = sparePlane;
}

namespace {

// Zeroes what a blur of `radius` does not write (see ReliefBlur), so the
// plane reads as a fresh zeroed one once the blur has run.
void ZeroOutsideBlur(unsigned char* plane, int width, int height, int radius) {
    const size_t w = size_t(width);
    if (width - 2 * int64_t(radius) <= 0 || height - 2 * int64_t(radius) <= 0) {
        std::memset(plane, 0, w * size_t(height));
        return;
    }
    const size_t r = size_t(radius);
    std::memset(plane, 0, r * w);
    std::memset(plane + (size_t(height) - r) * w, 0, r * w);
    for (size_t y = r; y < size_t(height) - r; ++y) {
        std::memset(plane + y * w, 0, r);
        std::memset(plane + y * w + w - r, 0, r);
    }
}

}  // namespace

bool ReliefSmoothAndSoften(GxReliefPlanes* planes, int width, int height, bool smooth,
                           int smoothRadius, int soften, GxScratch* scratch) {
    const size_t pixels = size_t(width) * size_t(height);
    auto spare = [&]() {
        if (planes->spare == nullptr) planes->spare = planes->Own(pixels, false);
        return planes->spare;
    };
    bool smoothed = false;
    if (smooth) {
        if (smoothRadius < 0) return false;  // its region would leave the planes
        unsigned char* third = spare();
        if (third == nullptr) return false;
        ZeroOutsideBlur(third, width, height, smoothRadius);
        const bool ok = ReliefBlur(planes->second, third, width, smoothRadius, height, scratch) == 0 &&
                        ReliefBlur(planes->first, planes->second, width, smoothRadius, height, scratch) == 0;
        planes->spare = planes->first;  // still the unblurred first wash
        planes->first = planes->second;
        planes->second = third;
        if (!ok) return false;
        smoothed = true;
    }
    if (soften >= 1) {
        // After smoothing the spare keeps the unblurred first wash, outer strips
        // included; without, it stands for a fresh zeroed plane.
        unsigned char* target = spare();
        if (target == nullptr) return false;
        if (!smoothed) ZeroOutsideBlur(target, width, height, soften);
        const bool ok = ReliefBlur(planes->second, target, width, soften, height, scratch) == 0 &&
                        ReliefBlur(planes->first, planes->second, width, soften, height, scratch) == 0;
        planes->spare = planes->first;
        planes->first = planes->second;
        planes->second = target;
        return ok;
    }
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
