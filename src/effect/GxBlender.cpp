#include "effect/GxBlender.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>

#include "effect/GxBlendRows.h"
#include "platform/Log.h"

// The compositor proper is a clipping front end: it intersects the source
// rectangle with the destination, then hands each destination row to a row
// kernel (GxBlendRows). The kernels hold all the arithmetic.

namespace Glimmer {

namespace {

constexpr char kTag[] = "Blender";

// The part of a w x h source placed at (x, y) that lands inside the
// destination: destination columns [x0, x1), rows [y0, y1), entered at
// source column sx, row sy. Computed in 64 bits so no placement can wrap.
struct Clip {
    int x0, x1, y0, y1, sx, sy;
};

bool ClipTo(const GxBitmap* dst, uint32_t bytesPerPixel, const void* src, int x, int y, int w,
            int h, Clip* c) {
    if (dst == nullptr || dst->pixels == nullptr || src == nullptr) return false;
    // A kernel writes bytesPerPixel bytes a pixel: a bitmap of another depth
    // would be overrun, so it is left alone.
    if (dst->bytesPerPixel != bytesPerPixel || w <= 0 || h <= 0) return false;
    const int64_t x0 = std::max<int64_t>(x, 0), y0 = std::max<int64_t>(y, 0);
    const int64_t x1 = std::min<int64_t>(int64_t(x) + w, dst->width);
    const int64_t y1 = std::min<int64_t>(int64_t(y) + h, dst->height);
    if (x0 >= x1 || y0 >= y1) return false;
    *c = {int(x0), int(x1), int(y0), int(y1), int(x0 - x), int(y0 - y)};
    return true;
}

uint8_t* DstRow(const GxBitmap* dst, const Clip& c, int row) {
    return dst->pixels + (size_t(row) * dst->width + size_t(c.x0)) * dst->bytesPerPixel;
}

// Runs `kernel` over every clipped row of an 8-bit source whose rows are
// `stride` bytes apart.
template <typename Kernel>
void ForEachRow8(int x, int y, const GxBitmap* dst, uint32_t dstBytes, const unsigned char* src,
                 int w, int h, int64_t stride, Kernel kernel) {
    Clip c;
    if (!ClipTo(dst, dstBytes, src, x, y, w, h, &c)) return;
    const int n = c.x1 - c.x0;
    for (int row = c.y0; row < c.y1; ++row) {
        const int64_t srcRow = row - c.y0 + c.sy;
        kernel(DstRow(dst, c, row), src + srcRow * stride + c.sx, n);
    }
}

}  // namespace

void GxBlender::drawBitmapBlend8(int x, int y, const GxBitmap* dst, const unsigned char* src, int w,
                                 int h, int stride, unsigned color, int mode) {
    if (dst == nullptr || dst->pixels == nullptr || src == nullptr) return;
    switch (mode) {
        case GxE_BLEND_SRC_OVER:
            blendSrcOver8To32(x, y, dst, src, w, h, stride, color);
            break;
        case GxE_BLEND_DST_OVER:
            blendDstOver8To32(x, y, dst, src, w, h, stride, color);
            break;
        case GxE_BLEND_DST_OVER_NSA:
            blendDstOver8To32NSA(x, y, dst, src, w, h, stride, color);
            Platform::LogPrint(Platform::kLogDebug, kTag, "Blender - GxE_BLEND_DST_OVER_NSA");
            break;
        case GxE_BLEND_OTHER:
            blendDstOverSA8To32(x, y, dst, src, w, h, stride, color);
            Platform::LogPrint(Platform::kLogDebug, kTag, "Blender - GxE_BLEND_OTHER");
            break;
        default:
            break;  // 4, 5, 6 and the rest draw nothing
    }
}

void GxBlender::blendSrcOver8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, unsigned color) {
    auto row = BlendRows::Active().srcOver8To32;
    ForEachRow8(x, y, dst, 4, src, w, h, stride,
                [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n, color); });
}

void GxBlender::blendDstOver8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, unsigned color) {
    auto row = BlendRows::Active().dstOver8To32;
    ForEachRow8(x, y, dst, 4, src, w, h, stride,
                [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n, color); });
}

void GxBlender::blendDstOver8To32NSA(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                     int w, int h, int stride, unsigned color) {
    auto row = BlendRows::Active().dstOver8To32NSA;
    ForEachRow8(x, y, dst, 4, src, w, h, stride,
                [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n, color); });
}

void GxBlender::blendDstOverSA8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                    int w, int h, int stride, unsigned color) {
    auto row = BlendRows::Active().dstOverSA8To32;
    ForEachRow8(x, y, dst, 4, src, w, h, stride,
                [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n, color); });
}

void GxBlender::drawBitmap(int x, int y, const GxBitmap* dst, const unsigned char* src, int w,
                           int h, unsigned color) {
    if (dst == nullptr || dst->pixels == nullptr || src == nullptr) return;
    if (dst->bytesPerPixel == 4) {
        drawBitmap8To32(x, y, dst, src, w, h, color);
    } else {
        drawBitmap8To8(x, y, dst, src, w, h);
    }
}

void GxBlender::drawBitmap(int x, int y, const GxBitmap* dst, const GxBitmap* src, unsigned color) {
    if (src == nullptr) return;
    drawBitmap(x, y, dst, src->pixels, int(src->width), int(src->height), color);
}

void GxBlender::drawBitmap8To32(int x, int y, const GxBitmap* dst, const unsigned char* src, int w,
                                int h, unsigned color) {
    auto row = BlendRows::Active().copy8To32;
    ForEachRow8(x, y, dst, 4, src, w, h, w,
                [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n, color); });
}

void GxBlender::drawBitmap8To8(int x, int y, const GxBitmap* dst, const unsigned char* src, int w,
                               int h) {
    auto row = BlendRows::Active().max8To8;
    ForEachRow8(x, y, dst, 1, src, w, h, w, [&](uint8_t* d, const uint8_t* s, int n) { row(d, s, n); });
}

void GxBlender::drawBitmapBlend32(int x, int y, const GxBitmap* dst, const unsigned* src, int w,
                                  int h, int stride, int mode) {
    if (mode == GxE_BLEND_DST_OVER) {
        blendDstOver32To32(x, y, dst, src, w, h, stride);
    } else if (mode == GxE_BLEND_SRC_OVER) {
        blendSrcOver32To32(x, y, dst, src, w, h, stride);
    }
}

void GxBlender::drawBitmapBlend32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, int /*ignored*/, int flag) {
    blendDstOver32To32(x, y, dst, src, w, h, stride, flag);
}

void GxBlender::blendSrcOver32To32(int x, int y, const GxBitmap* dst, const unsigned* src, int w,
                                   int h, int /*stride*/) {
    Clip c;
    if (!ClipTo(dst, 4, src, x, y, w, h, &c)) return;
    auto row = BlendRows::Active().srcOver32To32;
    for (int r = c.y0; r < c.y1; ++r)
        row(DstRow(dst, c, r), src + int64_t(r - c.y0 + c.sy) * w + c.sx, c.x1 - c.x0);
}

void GxBlender::blendDstOver32To32(int x, int y, const GxBitmap* dst, const unsigned* src, int w,
                                   int h, int /*stride*/) {
    Clip c;
    if (!ClipTo(dst, 4, src, x, y, w, h, &c)) return;
    auto row = BlendRows::Active().dstOver32To32;
    for (int r = c.y0; r < c.y1; ++r)
        row(DstRow(dst, c, r), src + int64_t(r - c.y0 + c.sy) * w + c.sx, c.x1 - c.x0);
}

void GxBlender::blendDstOver32To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                   int w, int h, int /*stride*/, int flag) {
    Clip c;
    if (!ClipTo(dst, 4, src, x, y, w, h, &c)) return;
    auto row = BlendRows::Active().dstOver32To32Bytes;
    for (int r = c.y0; r < c.y1; ++r)
        row(DstRow(dst, c, r), src + (int64_t(r - c.y0 + c.sy) * w + c.sx) * 4, c.x1 - c.x0, flag);
}

void GxBlender::convertBGRAToARGB(GxBitmap* bitmap) {
    if (bitmap == nullptr || bitmap->pixels == nullptr || bitmap->bytesPerPixel != 4) return;
    auto row = BlendRows::Active().swapRedBlue;
    for (uint32_t r = 0; r < bitmap->height; ++r)
        if (bitmap->width > 0) row(bitmap->pixels + size_t(r) * bitmap->width * 4, int(bitmap->width));
}

}  // namespace Glimmer
