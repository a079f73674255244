#pragma once
// Row kernels of the compositor and of the stack's final merge. Each works
// on one run of n >= 1 pixels that the caller has already clipped, so a
// vectorised twin only has to reproduce the per-pixel arithmetic: the
// compositor and the stack call through the table that Active() returns, the
// Highway twins for the CPU at hand (SSE4, AVX2, AVX-512 on x86-64, NEON on
// 64-bit Arm), and the scalar kernels stay as their reference.
//
// 32-bit destinations are bytes R, G, B, A. Colour arguments are 0xAARRGGBB.

#include <array>
#include <cstdint>
#include <vector>

#include "effect/GxKernelVariant.h"

namespace Glimmer::BlendRows {

// The final unpremultiply divides 256 q by the new alpha a (q, a < 256). With
// r[a] = ceil(2^24 / a), floor(256 q / a) == (q * r[a]) >> 16: the product
// overshoots 2^8 q / a by q * (a r[a] - 2^24) / (a 2^16) <= q (a - 1) / (a 2^16),
// below 1 / a because q (a - 1) < 2^16, and the fraction of 256 q / a is at
// most (a - 1) / a. r[0] = 0 makes a transparent pixel's colour 0, as the rule
// wants.
inline constexpr std::array<uint32_t, 256> kReciprocals = [] {
    std::array<uint32_t, 256> r{};
    for (uint32_t a = 1; a < 256; ++a) r[a] = ((1u << 24) + a - 1) / a;
    return r;
}();

using Rows8To32 = void (*)(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
using Rows8To8 = void (*)(uint8_t* dst, const uint8_t* coverage, int n);
using Rows32Words = void (*)(uint8_t* dst, const uint32_t* src, int n);
using Rows32Bytes = void (*)(uint8_t* dst, const uint8_t* src, int n, int flag);
using RowsSwap = void (*)(uint8_t* pixels, int n);
using RowsMerge = void (*)(uint8_t* dst, const uint8_t* work, const uint8_t* coverage, int n);
using RowsUnpremultiply = void (*)(uint8_t* pixels, int n, uint32_t alpha);
using RowsTable32 = void (*)(uint8_t* dst, const uint8_t* values, int n, const uint32_t* table);

struct Table {
    Rows8To32 srcOver8To32;
    Rows8To32 dstOver8To32;
    Rows8To32 dstOver8To32NSA;
    Rows8To32 dstOverSA8To32;
    Rows8To32 copy8To32;
    Rows8To8 max8To8;
    Rows32Words srcOver32To32;
    Rows32Words dstOver32To32;
    Rows32Bytes dstOver32To32Bytes;
    RowsSwap swapRedBlue;
    RowsMerge mergeWork;
    RowsUnpremultiply unpremultiply;
    // Unpremultiply, then swapRedBlue, in one pass.
    RowsUnpremultiply unpremultiplySwap;
    // dstOver32To32 of the words table[values[x]] (a glow's colouring and
    // drawing in one pass).
    RowsTable32 dstOverTable32;
};

// The reference kernels: plain C++, one pixel at a time.
namespace Scalar {
void SrcOver8To32(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
void DstOver8To32(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
void DstOver8To32NSA(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
void DstOverSA8To32(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
void Copy8To32(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
void Max8To8(uint8_t* dst, const uint8_t* coverage, int n);
void SrcOver32To32(uint8_t* dst, const uint32_t* src, int n);
void DstOver32To32(uint8_t* dst, const uint32_t* src, int n);
void DstOver32To32Bytes(uint8_t* dst, const uint8_t* src, int n, int flag);
void SwapRedBlue(uint8_t* pixels, int n);
void MergeWork(uint8_t* dst, const uint8_t* work, const uint8_t* coverage, int n);
void Unpremultiply(uint8_t* pixels, int n, uint32_t alpha);
void UnpremultiplySwap(uint8_t* pixels, int n, uint32_t alpha);
void DstOverTable32(uint8_t* dst, const uint8_t* values, int n, const uint32_t* table);
}  // namespace Scalar

const Table& ScalarTable();
// The kernels in use.
const Table& Active();

// Every compiled variant this CPU can run, for the tests.
using Variant = KernelTargets::Variant<Table>;
std::vector<Variant> Variants();

}  // namespace Glimmer::BlendRows
