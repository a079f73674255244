#pragma once
// The one tap loop of every Gaussian blur in the engine (outer and inner
// shadow, glows, reliefs), and the glow's 3 x 3 spread. A separable blur is two passes of the same row
// kernel: down the columns the taps of output x are the samples x - i * stride
// and x + i * stride of the rows above and below, along a row they are x - i
// and x + i. So the kernel takes the distance between taps as `step`:
//
//     sum = w[0] * c[x] + sum over i = 1..R of w[i] * (c[x - i*step] + c[x + i*step])
//     out[x] = min(sum / S, 255), or min((255 * S - sum) / S, 255) when inverted
//
// for x in [0, n). Every tap must be readable: the caller keeps R steps of
// samples on either side; `out` must not overlap them (the kernels may write
// an output twice). The quotient never exceeds 255 (the sum is at most
// 255 * S), so the clamp is only the rule written out.
//
// The literal loop, with a division per sample, is the reference; the kernels
// in use (Active()) divide by multiply and shift (GxDivisor) and are vectorised
// with Highway, chosen at run time on x86-64 (SSE4, AVX2, AVX-512) and NEON on
// 64-bit Arm. They give the reference's bytes for every input.

#include <cstddef>
#include <cstdint>
#include <vector>

#include "effect/GxKernelVariant.h"
#include "effect/filters/GxGaussian.h"

namespace Glimmer::BlurRows {

using BlurRow = void (*)(const uint8_t* centre, ptrdiff_t step, int n, const GxGaussian& gaussian,
                         bool inverted, uint8_t* out);
// The glow's spread: for x in [1, width - 1), out[x] = min(255, s >> 2) with s
// the sum of the 3 x 3 samples around x in the rows above, at and below.
// out[0] and out[width - 1] are not written. width >= 3; `out` overlaps none
// of the rows.
using SpreadRow = void (*)(const uint8_t* above, const uint8_t* row, const uint8_t* below, int width,
                           uint8_t* out);

// The glow's colouring: out[x] = table[values[x]] for x in [0, n), out apart
// from values.
using ShadeRow = void (*)(const uint8_t* values, int n, const uint32_t* table, uint32_t* out);
// Two blur rows: out0 centred on `centre`, out1 on centre + step (the caller
// keeps R + 1 steps of samples below); the x86 builds load each sample once
// for both.
using BlurRows2 = void (*)(const uint8_t* centre, ptrdiff_t step, int n, const GxGaussian& gaussian,
                           bool inverted, uint8_t* out0, uint8_t* out1);

// Two spread rows: out0 of (above, row, next), out1 of (row, next, below).
using SpreadRows2 = void (*)(const uint8_t* above, const uint8_t* row, const uint8_t* next, const uint8_t* below,
                             int width, uint8_t* out0, uint8_t* out1);

struct Table {
    BlurRow blurRow;
    SpreadRow spreadRow;
    ShadeRow shadeRow;
    BlurRows2 blurRows2;
    SpreadRows2 spreadRows2;
};

namespace Reference {
void BlurRow(const uint8_t* centre, ptrdiff_t step, int n, const GxGaussian& gaussian, bool inverted,
             uint8_t* out);
void SpreadRow(const uint8_t* above, const uint8_t* row, const uint8_t* below, int width, uint8_t* out);
void ShadeRow(const uint8_t* values, int n, const uint32_t* table, uint32_t* out);
void BlurRows2(const uint8_t* centre, ptrdiff_t step, int n, const GxGaussian& gaussian, bool inverted,
               uint8_t* out0, uint8_t* out1);
void SpreadRows2(const uint8_t* above, const uint8_t* row, const uint8_t* next, const uint8_t* below, int width,
                 uint8_t* out0, uint8_t* out1);
}  // namespace Reference

const Table& ReferenceTable();
// The kernels in use.
const Table& Active();

// Every compiled variant this CPU can run, for the tests.
using Variant = KernelTargets::Variant<Table>;
std::vector<Variant> Variants();

}  // namespace Glimmer::BlurRows
