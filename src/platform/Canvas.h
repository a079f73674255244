#pragma once
// The final picture of a text: a canvas over a 32-bit image of straight
// (not premultiplied) colour with alpha in the fourth byte of each pixel. It
// clears, clips to a rectangle, fills rectangles and draws another image of
// the same layout over it with source-over blending. It wraps the caller's
// pixels and owns nothing.

#include <cstdint>

namespace Glimmer::Platform {

class Canvas {
public:
    Canvas(uint8_t* pixels, int width, int height);

    // Every pixel to transparent black, whatever the clip.
    void Clear();
    // Narrows the clip to its intersection with [left, right) x [top, bottom).
    void ClipRect(int left, int top, int right, int bottom);
    // Every pixel outside the clip to transparent black.
    void ClearOutsideClip();
    // Fills the pixels whose centres lie inside the rectangle (no
    // anti-aliasing) with 0xAARRGGBB `color`, stored as bytes R, G, B, A.
    void FillRect(float left, float top, float right, float bottom, uint32_t color);
    // Draws a width x height image with its top-left corner at (x, y).
    void DrawImage(const uint8_t* pixels, int width, int height, int x, int y);

private:
    uint8_t* pixels_;
    int width_;
    int height_;
    int clipLeft_;
    int clipTop_;
    int clipRight_;
    int clipBottom_;
};

}  // namespace Glimmer::Platform
