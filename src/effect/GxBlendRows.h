#pragma once
// Row kernels of the compositor and of the stack's final merge. Each works
// on one run of n >= 1 pixels that the caller has already clipped, so a
// vectorised twin only has to reproduce the per-pixel arithmetic: the
// compositor and the stack call through the table that Active() returns,
// and a twin is installed there without touching any caller.
//
// 32-bit destinations are bytes R, G, B, A. Colour arguments are 0xAARRGGBB.

#include <cstdint>

namespace Glimmer::BlendRows {

using Rows8To32 = void (*)(uint8_t* dst, const uint8_t* coverage, int n, uint32_t color);
using Rows8To8 = void (*)(uint8_t* dst, const uint8_t* coverage, int n);
using Rows32Words = void (*)(uint8_t* dst, const uint32_t* src, int n);
using Rows32Bytes = void (*)(uint8_t* dst, const uint8_t* src, int n, int flag);
using RowsSwap = void (*)(uint8_t* pixels, int n);
using RowsMerge = void (*)(uint8_t* dst, const uint8_t* work, const uint8_t* coverage, int n);
using RowsUnpremultiply = void (*)(uint8_t* pixels, int n, uint32_t alpha);

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
}  // namespace Scalar

const Table& ScalarTable();
// The kernels in use.
const Table& Active();

}  // namespace Glimmer::BlendRows
