// The final picture on Linux, in plain pixel code.
//
// Both images hold straight colour. Source-over is computed exactly and
// rounded once: with source alpha sa, destination alpha da and t = 255 - sa,
//   alpha  = (sa * 255 + da * t) / 255
//   colour = (s * sa * 255 + d * da * t) / (sa * 255 + da * t)
// each rounded to the nearest integer; an opaque source replaces the pixel
// and a transparent one leaves it alone. Rectangles are filled without
// anti-aliasing: a pixel is inside when its centre is.

#include <algorithm>
#include <cmath>
#include <cstring>

#include "platform/Canvas.h"

namespace Glimmer::Platform {
namespace {

void BlendOver(uint8_t* d, const uint8_t* s) {
    uint32_t sa = s[3];
    if (sa == 0) return;
    if (sa == 255) {
        std::memcpy(d, s, 4);
        return;
    }
    uint32_t da = d[3];
    uint32_t t = 255 - sa;
    uint32_t weightS = sa * 255;       // source weight, scaled by 255
    uint32_t weightD = da * t;         // destination weight, scaled by 255
    uint32_t total = weightS + weightD;  // the result alpha, scaled by 255
    for (int c = 0; c < 3; ++c) {
        uint64_t num = uint64_t(s[c]) * weightS + uint64_t(d[c]) * weightD;
        d[c] = uint8_t((num + total / 2) / total);
    }
    d[3] = uint8_t((total + 127) / 255);
}

// The first pixel whose centre is at or right of `edge`.
int CentreIndex(float edge) {
    constexpr float kFar = 1.0e9f;
    if (!(edge > -kFar)) return -1000000000;
    if (!(edge < kFar)) return 1000000000;
    return int(std::ceil(edge - 0.5f));
}

}  // namespace

Canvas::Canvas(uint8_t* pixels, int width, int height)
    : pixels_(pixels),
      width_(pixels != nullptr && width > 0 && height > 0 ? width : 0),
      height_(pixels != nullptr && width > 0 && height > 0 ? height : 0),
      clipLeft_(0),
      clipTop_(0),
      clipRight_(width_),
      clipBottom_(height_) {}

void Canvas::Clear() {
    if (width_ > 0) std::memset(pixels_, 0, size_t(width_) * size_t(height_) * 4);
}

void Canvas::ClipRect(int left, int top, int right, int bottom) {
    clipLeft_ = std::max(clipLeft_, left);
    clipTop_ = std::max(clipTop_, top);
    clipRight_ = std::min(clipRight_, right);
    clipBottom_ = std::min(clipBottom_, bottom);
}

void Canvas::ClearOutsideClip() {
    if (width_ <= 0) return;
    const size_t rowBytes = size_t(width_) * 4;
    const int x0 = std::clamp(clipLeft_, 0, width_), x1 = std::clamp(clipRight_, x0, width_);
    const int y0 = std::clamp(clipTop_, 0, height_), y1 = std::clamp(clipBottom_, y0, height_);
    std::memset(pixels_, 0, size_t(y0) * rowBytes);
    for (int y = y0; y < y1; ++y) {
        uint8_t* row = pixels_ + size_t(y) * rowBytes;
        std::memset(row, 0, size_t(x0) * 4);
        std::memset(row + size_t(x1) * 4, 0, size_t(width_ - x1) * 4);
    }
    std::memset(pixels_ + size_t(y1) * rowBytes, 0, size_t(height_ - y1) * rowBytes);
}

void Canvas::FillRect(float left, float top, float right, float bottom, uint32_t color) {
    int x0 = std::max(clipLeft_, CentreIndex(left));
    int x1 = std::min(clipRight_, CentreIndex(right));
    int y0 = std::max(clipTop_, CentreIndex(top));
    int y1 = std::min(clipBottom_, CentreIndex(bottom));
    const uint8_t source[4] = {uint8_t(color >> 16), uint8_t(color >> 8), uint8_t(color),
                               uint8_t(color >> 24)};
    for (int y = y0; y < y1; ++y) {
        uint8_t* row = pixels_ + (size_t(y) * size_t(width_)) * 4;
        for (int x = x0; x < x1; ++x) BlendOver(row + size_t(x) * 4, source);
    }
}

void Canvas::DrawImage(const uint8_t* pixels, int width, int height, int x, int y) {
    if (pixels == nullptr || width <= 0 || height <= 0) return;
    int x0 = std::max(clipLeft_, x);
    int y0 = std::max(clipTop_, y);
    int64_t x1 = std::min<int64_t>(clipRight_, int64_t(x) + width);
    int64_t y1 = std::min<int64_t>(clipBottom_, int64_t(y) + height);
    for (int row = y0; row < y1; ++row) {
        const uint8_t* src = pixels + (size_t(row - y) * size_t(width) + size_t(x0 - x)) * 4;
        uint8_t* dst = pixels_ + (size_t(row) * size_t(width_) + size_t(x0)) * 4;
        for (int col = x0; col < x1; ++col, src += 4, dst += 4) BlendOver(dst, src);
    }
}

}  // namespace Glimmer::Platform
