#pragma once
// Row kernels of the stroke's dilation (see GxStroke.cpp for how a disc
// kernel becomes chords).
//
// One output row of the dilation is a maximum over terms. A term stands for
// one chord of one kernel row at one coverage level: the largest source
// sample on the chord, less `cut` (255 minus the level), never below 0. A
// chord's largest sample is the larger of two overlapping power-of-two spans,
// read from a table of span maxima (row j holds the maximum of the 2^j
// samples from x on), so every term costs two reads whatever its length:
//
//     out[x] = max over terms i of max(0, max(a_i[x], b_i[x]) - cut_i)
//
// The first `flat` terms have cut 0; once they give 255 in every pixel the
// rest cannot change anything, so the kernels may stop early there (the
// result is the same).
//
// The literal loop is the reference; the kernels in use (Active()) are its
// Highway builds, chosen at run time on x86-64 (SSE4, AVX2, AVX-512) and NEON
// on 64-bit Arm.

#include <cstdint>
#include <vector>

#include "effect/GxKernelVariant.h"

namespace Glimmer::StrokeRows {

struct Term {
    const uint8_t* a;  // a[x] and b[x] are read for x in [0, n)
    const uint8_t* b;
    uint8_t cut;
};

using DilateRow = void (*)(const Term* terms, int flat, int count, int n, uint8_t* out);
// out[x] = max(a[x], b[x]), x in [0, n): one row of the span table from the row
// below (out apart from a and b).
using MaxRow = void (*)(const uint8_t* a, const uint8_t* b, int n, uint8_t* out);
// out[x] = min(out[x], other[x]): the band of a centred stroke.
using MinRow = void (*)(uint8_t* out, const uint8_t* other, int n);

struct Table {
    DilateRow dilateRow;
    MaxRow maxRow;
    MinRow minRow;
};

namespace Reference {
void DilateRow(const Term* terms, int flat, int count, int n, uint8_t* out);
void MaxRow(const uint8_t* a, const uint8_t* b, int n, uint8_t* out);
void MinRow(uint8_t* out, const uint8_t* other, int n);
}  // namespace Reference

const Table& ReferenceTable();
// The kernels in use.
const Table& Active();

// Every compiled variant this CPU can run, for the tests.
using Variant = KernelTargets::Variant<Table>;
std::vector<Variant> Variants();

}  // namespace Glimmer::StrokeRows
