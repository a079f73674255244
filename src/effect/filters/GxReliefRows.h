#pragma once
// The row kernels of the relief layers (bevel, emboss): the lighting of a row
// of the height field into the two wash planes, one source's sweep of the
// local distance search, a row of the emboss's inward search, and the
// colouring of the two washes (and of the emboss's two reliefs).
//
// Each is written once as the literal scalar loop (Reference) and once with
// Highway, compiled for SSE4, AVX2 and AVX-512 on x86-64 and NEON on 64-bit
// Arm and chosen at run time (Active()). The vector forms do the scalar
// arithmetic lane by lane, operation for operation: the same single-precision
// products, sums and quotient in the same order (no fused multiply-add), the
// same truncating conversions, the same compare-and-select for every clamp
// (so a NaN goes where the scalar code sends it). They give the reference's
// bytes for every input; the tests check that on random rows.

#include <cstddef>
#include <cstdint>
#include <vector>

#include "effect/GxKernelVariant.h"

namespace Glimmer::ReliefRows {

// What the lighting of one relief needs besides the field.
struct Light {
    float x = 0.0f, y = 0.0f, z = 0.0f;  // the light vector
    float normalZ = 1.0f;
    float range = 0.0f;     // bevel: the flat height; emboss: the outer range Ro
    float inRange = 0.0f;   // emboss: the inner range Ri
    int secondAlpha = 0;
    int firstAlpha = 0;
    bool inside = false;    // bevel: style 1 takes the level as it is
};

// Bevel: for x in [0, n), unless d[x] == range, both planes from the slope at
// d + x (rows `stride` floats apart above and below, columns beside). Pixels
// at the flat height keep their plane bytes.
using BevelLightRow = void (*)(const float* d, ptrdiff_t stride, int n, const Light& light,
                               uint8_t* second, uint8_t* first);
// Emboss, hard technique: the signed field, pixels at exactly Ro kept.
using EmbossHardLightRow = void (*)(const float* f, ptrdiff_t stride, int n, const Light& light,
                                    uint8_t* second, uint8_t* first);
// Emboss, soft technique: the outer slope where 0 < o < Ro, then the inner one
// (a descending height) where 0 < in < Ri; other pixels kept.
using EmbossSoftLightRow = void (*)(const float* o, const float* in, ptrdiff_t stride, int n,
                                    const Light& light, uint8_t* second, uint8_t* first);

// One source of the local search, swept over the rows it reaches:
// for each row y in [rowBegin, rowEnd), a = |y - sourceRow|, the columns
// x - min(chords[a], left) .. x + min(chords[a], right) inside [0, width)
// become
//     candidate < value ? candidate : value,   candidate = amount + roots[a][dx]
// with roots[a] pointing at dx = 0 of that row's roots.
struct Disc {
    const int* chords;          // chords[a], a = 0..radius
    const float* const* roots;  // roots[a][dx] for |dx| <= chords[a]
};
using SweepSource = void (*)(float* field, ptrdiff_t stride, int width, int x, int sourceRow, int rowBegin,
                             int rowEnd, int left, int right, const Disc& disc, float amount);

// Which sides of its disc each pixel of a row sweeps in the outward search,
// for x in [1, n - 1): 0 unless row[x] < 1.0 (a source), else bit 0 when the
// pixel to the left does not serve, bit 1 the one to the right, bit 2 above,
// bit 3 below. A neighbour serves when it is a source whose amount is no
// larger; the amount of v is v, or (`positive`) 0 when v is not above 0.
// sides[0] and sides[n - 1] are not written.
using SweepSides = void (*)(const float* above, const float* row, const float* below, int n, bool positive,
                            uint8_t* sides);

// The exact transform's rows within a reach: for x in [0, n),
// out[x] = min over |dx| <= radius of line[x + dx] + dx^2 (`radius` readable
// entries on either side of the row).
using NearRow = void (*)(const float* line, int radius, int n, float* out);

// A row of the emboss's inward search: for x in [0, n) with cur[x] < 0,
// out[x] = the largest of cur[x] and every sources[x + dx + a * stride] -
// roots[(a + radius) * (2 * radius + 1) + dx + radius] (kept only when
// larger), a in [-above, below], |dx| <= radius; other columns copy cur.
// `sources` holds the source values and -infinity elsewhere, with `radius`
// readable columns on either side of the row.
using InwardRow = void (*)(const float* sources, ptrdiff_t stride, int above, int below, int radius,
                           const float* roots, const float* cur, float* out, int n);

// The colouring of n pixels (ReliefColourise): s = int(gain * first),
// l = int(gain * second); the winner's colour (the first when s > l)
// premultiplied by min(|s - l|, 255), as 0xAARRGGBB.
using ColouriseRow = void (*)(const uint8_t* first, const uint8_t* second, int n, float gain,
                              uint32_t firstColour, uint32_t secondColour, uint32_t* out);

// The emboss's two-sided colouring of n pixels: the normal relief's tone
// (planes normalFirst, normalSecond) weighted by the coverage m, laid over the
// mirrored one's weighted by 255 - m, premultiplied, as 0xAARRGGBB.
using TwoSidedRow = void (*)(const uint8_t* normalFirst, const uint8_t* normalSecond, const uint8_t* mirroredFirst,
                             const uint8_t* mirroredSecond, const uint8_t* coverage, int n, float gain,
                             uint32_t firstColour, uint32_t secondColour, uint32_t* out);

struct Table {
    BevelLightRow bevelLight;
    EmbossHardLightRow embossHardLight;
    EmbossSoftLightRow embossSoftLight;
    SweepSource sweepSource;
    SweepSides sweepSides;
    NearRow nearRow;
    InwardRow inwardRow;
    ColouriseRow colourise;
    TwoSidedRow twoSided;
};

namespace Reference {
void BevelLight(const float* d, ptrdiff_t stride, int n, const Light& light, uint8_t* second, uint8_t* first);
void EmbossHardLight(const float* f, ptrdiff_t stride, int n, const Light& light, uint8_t* second,
                     uint8_t* first);
void EmbossSoftLight(const float* o, const float* in, ptrdiff_t stride, int n, const Light& light,
                     uint8_t* second, uint8_t* first);
void SweepSource(float* field, ptrdiff_t stride, int width, int x, int sourceRow, int rowBegin, int rowEnd,
                 int left, int right, const Disc& disc, float amount);
void SweepSides(const float* above, const float* row, const float* below, int n, bool positive, uint8_t* sides);
void NearRow(const float* line, int radius, int n, float* out);
void InwardRow(const float* sources, ptrdiff_t stride, int above, int below, int radius, const float* roots,
               const float* cur, float* out, int n);
void Colourise(const uint8_t* first, const uint8_t* second, int n, float gain, uint32_t firstColour,
               uint32_t secondColour, uint32_t* out);
void TwoSided(const uint8_t* normalFirst, const uint8_t* normalSecond, const uint8_t* mirroredFirst,
              const uint8_t* mirroredSecond, const uint8_t* coverage, int n, float gain, uint32_t firstColour,
              uint32_t secondColour, uint32_t* out);
}  // namespace Reference

const Table& ReferenceTable();
// The kernels in use.
const Table& Active();

// Every compiled variant this CPU can run, for the tests.
using Variant = KernelTargets::Variant<Table>;
std::vector<Variant> Variants();

}  // namespace Glimmer::ReliefRows
