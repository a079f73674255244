// Local distance searches of the relief layers
//
// The smaller bevels and every hard or small emboss build their height field
// by local searches instead of a distance transform. Both are defined by a
// literal scan, kept below as the reference: pixels in rows, then columns,
// each looking at every pixel of its square window and keeping an
// improvement at once.
//
// Outward search (bevel; emboss outward pass). A target (any value but 0,
// or above 0) takes the smallest A(q) + R(dx^2 + dy^2) over the sources q of
// its window, the pixels below 1.0, where A(q) is the source's value (or 0
// for a non-positive one in the emboss) and R the rounded square-root table.
// What makes it fast, each step exact:
//   - Sources never change, so no order matters. A candidate is A >= 0 plus a
//     root of at least 1.0 for any other pixel, so an improvement is never
//     below 1.0 (no new source), and a target below 1.0 cannot improve.
//     A negative source would break that (kNonZero only): the literal runs.
//   - Scatter instead of gather: each source sweeps its candidates over the
//     pixels around it and every pixel keeps the smallest. The minimum is
//     the literal's minimum; equal candidates have equal values.
//   - Only a disc. A source farther than the radius gives a candidate of at
//     least R(r^2 + 1) >= r, never below a target's value when that value is
//     at most R(r^2 + 1), which every field the layers build satisfies (their
//     far value is the radius). Other targets (hand-made fields) take the
//     literal window scan first.
//   - Only where no other source does better. Say a source q' serves q when
//     its amount is no larger. If q' lies on q's row, k columns to the
//     right, then for every pixel p in a column at or past q' it is nearer
//     than q and no farther in either coordinate (so inside p's window and
//     disc): its candidate is no worse, and q need not reach p. Likewise to
//     the left, and up and down q's column (a pixel outside the field counts
//     as serving). So q sweeps the columns short of the first serving source
//     on each side of its row, times the rows short of the first above and
//     below: nothing inside a glyph, a row or a half disc along its outline,
//     a few pixels in a noisy mask (induction on the distance shows every
//     pixel still gets its best candidate from some sweep). The adjacent
//     neighbours are tested for a whole row at once by a vector kernel; a
//     side they leave open is looked along for a few steps when the disc is
//     large (a small one costs about what the look would).
//   - Each swept row is one vector compare-and-select (GxReliefRows).
//   Beyond kSweepRadius the disc tables grow too large and the older
//   nearest-first gather serves (a summed-area table skips empty windows,
//   rows and then columns are visited outward until a root alone is no
//   better than the best found).
//
// Inward search (emboss, after the outward pass). A target (below 0) takes
// the largest v - R(dx^2 + dy^2) over the pixels above 1.0 in its window.
// No pruning bound helps here (the best candidate comes from near the edge
// and the largest values are far from it), so the window is gathered in
// full, but on a vector of targets at once from a plane where non-sources
// read -infinity, and only for vectors holding a target. An improvement
// above 1.0 would make a new source for the pixels after it: from there on
// the literal scan continues (no field the emboss builds gets there).

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <limits>

#include "effect/filters/GxRelief.h"
#include "effect/filters/GxReliefRows.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

// Largest radius swept by discs (their tables are (r + 1) x (2r + 1) floats).
constexpr int kSweepRadius = 128;
// Largest inward window gathered by vectors ((2r + 1)^2 roots).
constexpr int kInwardRadius = 128;
// Smallest radius whose sweeps look along an open side for a serving source,
// and how far they look: a few steps find the next source of a noisy mask and
// cost little beside a large disc.
constexpr int kWalkRadius = 16;
constexpr int kWalkSteps = 4;
// Vector lanes the inward plane is padded for (AVX-512 floats).
constexpr int kLanePadding = 16;

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

// sqrt(i) as the rounded table holds it (IntSqrt: the largest k with
// (2k - 1)^2 <= 4e6 i, over 1000), found from the double root and checked
// in integers instead of by a binary search.
float TableRoot(int64_t i) {
    if (i < kIntSqrtTableSize) return GX_INT_SQRT_TABLE[size_t(i)];
    const uint64_t target = uint64_t(4000000) * uint64_t(i);
    uint64_t k = uint64_t(std::llround(std::sqrt(double(i)) * 1000.0));
    while (k > 0 && (2 * k - 1) * (2 * k - 1) > target) --k;
    while ((2 * k + 1) * (2 * k + 1) <= target) ++k;
    return float(double(k) / 1000.0);
}

inline int ClampRadius(int radius, int width, int height) {
    int largest = width > height ? width : height;
    return radius > largest ? largest : radius;
}

// How far the sweep of the source at (x, y) reaches in the direction
// (dx, dy): r, or short of a serving source found within kWalkSteps. Kept
// out of line: the loop over a row's pixels stays small.
[[gnu::noinline]] int Reach(const float* field, int width, int height, int x, int y, int dx, int dy, int r, float amount,
          bool positive) {
    for (int steps = 1; steps <= kWalkSteps; ++steps) {
        x += dx;
        y += dy;
        if (x < 0 || x >= width || y < 0 || y >= height) break;
        const float n = field[size_t(y) * size_t(width) + size_t(x)];
        if (n < 1.0f && (positive && !(n > 0.0f) ? 0.0f : n) <= amount) return steps - 1;
    }
    return r;
}

// The literal scan of one target at (x, y), as ReliefLocalDistanceReference
// runs it.
void OutwardPixel(float* field, int width, int height, int r, int x, int y, GxReliefTargets targets,
                  const GxReliefRoots& roots) {
    const size_t stride = size_t(width);
    float cur = field[size_t(y) * stride + size_t(x)];
    const int yyEnd = y + r + 1 < height ? y + r + 1 : height;
    const int xxEnd = x + r + 1 < width ? x + r + 1 : width;
    for (int yy = y - r > 0 ? y - r : 0; yy < yyEnd; ++yy) {
        for (int xx = x - r > 0 ? x - r : 0; xx < xxEnd; ++xx) {
            const float v = field[size_t(yy) * stride + size_t(xx)];
            if (!(v < 1.0f)) continue;
            const int64_t dy = yy - y;
            const int64_t dx = xx - x;
            const float root = roots[dy * dy + dx * dx];
            const float candidate = targets == GxReliefTargets::kPositive && !(v > 0.0f) ? root : v + root;
            if (candidate < cur) {
                cur = candidate;
                field[size_t(y) * stride + size_t(x)] = cur;
            }
        }
    }
}

// The literal inward scan of one target at (x, y).
void InwardPixel(float* field, int width, int height, int r, int x, int y, const GxReliefRoots& roots) {
    const size_t stride = size_t(width);
    float cur = field[size_t(y) * stride + size_t(x)];
    if (!(cur < 0.0f)) return;
    const int yyEnd = y + r + 1 < height ? y + r + 1 : height;
    const int xxEnd = x + r + 1 < width ? x + r + 1 : width;
    for (int yy = y - r > 0 ? y - r : 0; yy < yyEnd; ++yy) {
        const float* row = field + size_t(yy) * stride;
        const int64_t dy2 = int64_t(yy - y) * (yy - y);
        for (int xx = x - r > 0 ? x - r : 0; xx < xxEnd; ++xx) {
            const float v = row[xx];
            if (!(v > 1.0f)) continue;
            const float candidate = v - roots[dy2 + int64_t(xx - x) * (xx - x)];
            if (cur < candidate) {
                cur = candidate;
                field[size_t(y) * stride + size_t(x)] = cur;
            }
        }
    }
}

// The inward literal from pixel (x, y) to the end of row y1 - 1.
void InwardLiteralFrom(float* field, int width, int height, int r, int x, int y, int y1,
                       const GxReliefRoots& roots) {
    for (; y < y1; ++y, x = 0)
        for (; x < width; ++x) InwardPixel(field, width, height, r, x, y, roots);
}

// The nearest-first gather, for radii past kSweepRadius (see the top).
void NearestFirst(float* field, int width, int height, int r, int y0, int y1, GxReliefTargets targets) {
    const int rowsBegin = y0 - r > 0 ? y0 - r : 0;
    const int rowsEnd = int64_t(y1) + r < height ? y1 + r : height;
    const size_t rows = size_t(rowsEnd - rowsBegin);
    const size_t satStride = size_t(width) + 1;
    const size_t stride = size_t(width);

    // sat[j][x]: sources in rows [rowsBegin, rowsBegin + j), columns [0, x).
    auto* sat = static_cast<uint32_t*>(std::calloc((rows + 1) * satStride, sizeof(uint32_t)));
    FreeOnExit freeSat{sat};
    if (sat == nullptr) {
        ReliefLocalDistanceReference(field, width, height, r, y0, y1, targets);
        return;
    }
    for (size_t j = 0; j < rows; ++j) {
        const float* row = field + (rowsBegin + j) * stride;
        const uint32_t* above = sat + j * satStride;
        uint32_t* here = sat + (j + 1) * satStride;
        uint32_t run = 0;
        for (int x = 0; x < width; ++x) {
            if (row[x] < 1.0f) ++run;
            here[x + 1] = above[x + 1] + run;
        }
    }
    const size_t sourceCount = sat[rows * satStride + stride];
    if (sourceCount == 0) return;

    int* columns = static_cast<int*>(std::malloc(sizeof(int) * sourceCount));
    FreeOnExit freeColumns{columns};
    float* amounts = static_cast<float*>(std::malloc(sizeof(float) * sourceCount));
    FreeOnExit freeAmounts{amounts};
    if (columns == nullptr || amounts == nullptr) {
        ReliefLocalDistanceReference(field, width, height, r, y0, y1, targets);
        return;
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

            // Every candidate is at least the root of its distance (roots grow
            // with the distance, the amount is >= 0): a direction stops as soon
            // as its root alone is no better than the best found.
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
}

}  // namespace

// ---- outward

void ReliefLocalDistanceReference(float* field, int width, int height, int radius, int y0, int y1,
                                  GxReliefTargets targets) {
    if (field == nullptr || width <= 0 || height <= 0) return;
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    const int r = ClampRadius(radius, width, height);
    if (y0 >= y1 || r < 0) return;
    GxReliefRoots roots(ReliefLargestRootIndex(width, height, r));
    for (int y = y0; y < y1; ++y)
        for (int x = 0; x < width; ++x)
            if (IsTarget(field[size_t(y) * size_t(width) + size_t(x)], targets))
                OutwardPixel(field, width, height, r, x, y, targets, roots);
}

int ReliefLocalDistance(float* field, int width, int height, int radius, int y0, int y1, GxReliefTargets targets,
                        GxScratch* scratch) {
    if (field == nullptr || width <= 0 || height <= 0) return 0;
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    const int r = ClampRadius(radius, width, height);
    // A window of the pixel alone never improves it.
    if (y0 >= y1 || r <= 0) return 0;
    const int rowsBegin = y0 - r > 0 ? y0 - r : 0;
    const int rowsEnd = int64_t(y1) + r < height ? y1 + r : height;
    const size_t stride = size_t(width);
    // A negative source (kNonZero) and targets above R(r^2 + 1): see the top.
    const float bound = TableRoot(int64_t(r) * r + 1);
    bool negative = false;
    bool wide = false;
    for (int j = rowsBegin; j < rowsEnd; ++j) {
        const float* row = field + size_t(j) * stride;
        int below = 0;
        int above = 0;
        for (int x = 0; x < width; ++x) below |= row[x] < 0.0f;
        if (j >= y0 && j < y1)
            for (int x = 0; x < width; ++x) above |= row[x] > bound;  // targets all, as bound > 0
        negative |= below != 0 && targets == GxReliefTargets::kNonZero;
        wide |= above != 0;
    }
    if (negative) {
        ReliefLocalDistanceReference(field, width, height, r, y0, y1, targets);
        return 0;
    }
    if (r > kSweepRadius) {
        NearestFirst(field, width, height, r, y0, y1, targets);
        return 0;
    }
    if (wide) {
        GxReliefRoots windowRoots(ReliefLargestRootIndex(width, height, r));
        for (int y = y0; y < y1; ++y)
            for (int x = 0; x < width; ++x)
                if (field[size_t(y) * stride + size_t(x)] > bound)
                    OutwardPixel(field, width, height, r, x, y, targets, windowRoots);
    }

    // The disc: chords[a] = the largest c with a^2 + c^2 <= r^2, and the roots
    // of every offset inside it, row by row.
    const size_t rows = size_t(r) + 1;
    const size_t rootCount = rows * size_t(2 * r + 1);
    GxReliefBuffer tables(scratch, GxScratch::kRows);
    auto* memory = tables.get<unsigned char>(rows * (sizeof(const float*) + sizeof(int)) + rootCount * sizeof(float));
    if (memory == nullptr) {
        ReliefLocalDistanceReference(field, width, height, r, y0, y1, targets);
        return 0;
    }
    auto** rootRows = reinterpret_cast<const float**>(memory);
    auto* chords = reinterpret_cast<int*>(memory + rows * sizeof(const float*));
    auto* rootValues = reinterpret_cast<float*>(memory + rows * (sizeof(const float*) + sizeof(int)));
    float* next = rootValues;
    int chord = r;
    for (int a = 0; a <= r; ++a) {
        const int64_t a2 = int64_t(a) * a;
        while (a2 + int64_t(chord) * chord > int64_t(r) * r) --chord;
        chords[a] = chord;
        rootRows[a] = next + chord;
        for (int dx = -chord; dx <= chord; ++dx) *next++ = TableRoot(a2 + int64_t(dx) * dx);
    }
    const ReliefRows::Disc disc{chords, rootRows};

    // Every source sweeps the part of its disc no other source serves. Per
    // row, branch-free (it vectorises): which sides each pixel sweeps, as bits
    // (0: not a source, or served on every side). Outside the field a row of
    // -infinity stands in: a source with an amount below any.
    const ReliefRows::SweepSource sweep = ReliefRows::Active().sweepSource;
    GxReliefBuffer rowMemory(scratch, GxScratch::kPlaneC);
    auto* rowBytes = rowMemory.get<unsigned char>((stride + 2) * (sizeof(float) + 1));
    if (rowBytes == nullptr) {
        ReliefLocalDistanceReference(field, width, height, r, y0, y1, targets);
        return 0;
    }
    auto* outside = reinterpret_cast<float*>(rowBytes);
    unsigned char* sides = rowBytes + (stride + 2) * sizeof(float);
    for (size_t i = 0; i < stride + 2; ++i) outside[i] = -std::numeric_limits<float>::infinity();
    const bool positive = targets == GxReliefTargets::kPositive;
    const ReliefRows::SweepSides sidesOf = ReliefRows::Active().sweepSides;
    for (int j = rowsBegin; j < rowsEnd; ++j) {
        const float* row = field + size_t(j) * stride;
        const float* above = j > 0 ? row - stride : outside + 1;
        const float* below = j + 1 < height ? row + stride : outside + 1;
        // The two end columns through a padded copy of their neighbourhood.
        for (int x : {0, width - 1}) {
            const float left = x > 0 ? row[x - 1] : outside[0];
            const float right = x + 1 < width ? row[x + 1] : outside[0];
            const float line[3] = {left, row[x], right};
            const float up[3] = {0.0f, above[x], 0.0f};
            const float down[3] = {0.0f, below[x], 0.0f};
            unsigned char bits[3];
            ReliefRows::Reference::SweepSides(up, line, down, 3, positive, bits);
            sides[x] = bits[1];
        }
        sidesOf(above, row, below, width, positive, sides);
        auto amountOf = [positive](float v) { return positive && !(v > 0.0f) ? 0.0f : v; };
        for (int x = 0; x < width; ++x) {
            const int bits = sides[x];
            if (bits == 0) continue;
            const float amount = amountOf(row[x]);
            // How far each side reaches: to the radius, or short of the first
            // source on that line that serves (nearer to everything past it),
            // looked for a few steps out when the disc is large.
            int left = bits & 1 ? r : 0;
            int right = bits & 2 ? r : 0;
            int up = bits & 4 ? r : 0;
            int down = bits & 8 ? r : 0;
            if (r >= kWalkRadius) {
                if (left) left = Reach(field, width, height, x, j, -1, 0, r, amount, positive);
                if (right) right = Reach(field, width, height, x, j, 1, 0, r, amount, positive);
                if (up) up = Reach(field, width, height, x, j, 0, -1, r, amount, positive);
                if (down) down = Reach(field, width, height, x, j, 0, 1, r, amount, positive);
            }
            const int top = j - up;
            const int bottom = int(int64_t(j) + down + 1);
            const int begin = top > y0 ? top : y0;
            const int end = bottom < y1 ? bottom : y1;
            if (begin < end) sweep(field, ptrdiff_t(stride), width, x, j, begin, end, left, right, disc, amount);
        }
    }
    return 0;
}

// ---- inward

void ReliefInwardDistanceReference(float* field, int width, int height, int radius, int y0, int y1) {
    if (field == nullptr || width <= 0 || height <= 0) return;
    const int r = ClampRadius(radius, width, height);
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    if (r < 0) return;
    GxReliefRoots roots(ReliefLargestRootIndex(width, height, r));
    InwardLiteralFrom(field, width, height, r, 0, y0, y1, roots);
}

void ReliefInwardDistance(float* field, int width, int height, int radius, int y0, int y1, GxScratch* scratch) {
    if (field == nullptr || width <= 0 || height <= 0) return;
    const int r = ClampRadius(radius, width, height);
    if (y0 < 0) y0 = 0;
    if (y1 > height) y1 = height;
    // The window of a pixel alone holds no source: a target is below 0.
    if (r <= 0 || y0 >= y1) return;
    if (r > kInwardRadius) {
        ReliefInwardDistanceReference(field, width, height, r, y0, y1);
        return;
    }
    const int rowsBegin = y0 - r > 0 ? y0 - r : 0;
    const int rowsEnd = int64_t(y1) + r < height ? y1 + r : height;
    const size_t stride = size_t(width);

    // The sources with r columns of -infinity on either side (and lanes'
    // worth more on the right), rows [rowsBegin, rowsEnd).
    const size_t planeStride = stride + 2 * size_t(r) + kLanePadding;
    const size_t planeFloats = size_t(rowsEnd - rowsBegin) * planeStride;
    const size_t side = size_t(2 * r + 1);
    GxReliefBuffer planeMemory(scratch, GxScratch::kPlaneC);
    GxReliefBuffer rowMemory(scratch, GxScratch::kRows);
    float* plane = planeMemory.get<float>(planeFloats);
    float* windowRoots = rowMemory.get<float>(side * side + stride);
    if (plane == nullptr || windowRoots == nullptr) {
        ReliefInwardDistanceReference(field, width, height, r, y0, y1);
        return;
    }
    float* out = windowRoots + side * side;
    const float none = -std::numeric_limits<float>::infinity();
    for (int j = rowsBegin; j < rowsEnd; ++j) {
        const float* row = field + size_t(j) * stride;
        float* p = plane + size_t(j - rowsBegin) * planeStride;
        for (size_t i = 0; i < size_t(r); ++i) p[i] = none;
        for (size_t x = 0; x < stride; ++x) p[r + x] = row[x] > 1.0f ? row[x] : none;
        for (size_t i = size_t(r) + stride; i < planeStride; ++i) p[i] = none;
    }
    for (int a = -r; a <= r; ++a)
        for (int dx = -r; dx <= r; ++dx)
            windowRoots[size_t(a + r) * side + size_t(dx + r)] = TableRoot(int64_t(a) * a + int64_t(dx) * dx);

    const ReliefRows::InwardRow inwardRow = ReliefRows::Active().inwardRow;
    for (int y = y0; y < y1; ++y) {
        float* row = field + size_t(y) * stride;
        const int above = y - r > 0 ? r : y;
        const int below = int64_t(y) + r < height ? r : height - 1 - y;
        const float* centre = plane + size_t(y - rowsBegin) * planeStride + size_t(r);
        inwardRow(centre, ptrdiff_t(planeStride), above, below, r, windowRoots, row, out, width);
        for (int x = 0; x < width; ++x) {
            if (!(row[x] < 0.0f)) continue;
            row[x] = out[x];
            if (out[x] > 1.0f) {
                // A new source for the pixels after this one.
                GxReliefRoots literalRoots(ReliefLargestRootIndex(width, height, r));
                InwardLiteralFrom(field, width, height, r, x + 1, y, y1, literalRoots);
                return;
            }
        }
    }
}

}  // namespace Glimmer
