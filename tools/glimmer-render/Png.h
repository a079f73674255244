#pragma once
// PNG files in and out (libpng), and the plain image the renderer passes
// around: 0xAARRGGBB words with straight (not premultiplied) alpha, rows top
// to bottom, exactly the int array a Java caller receives.

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace Glimmer::RenderTool {

struct Image {
    int width = 0;
    int height = 0;
    std::vector<uint32_t> pixels;

    Image() = default;
    Image(int w, int h, uint32_t fill = 0) : width(w), height(h), pixels(size_t(w) * size_t(h), fill) {}
    uint32_t At(int x, int y) const { return pixels[size_t(y) * size_t(width) + size_t(x)]; }
    uint32_t& At(int x, int y) { return pixels[size_t(y) * size_t(width) + size_t(x)]; }
};

// Any PNG, converted to 8-bit RGBA. A RenderError naming `what` when the file
// cannot be read, is no PNG, or is larger than `maxSide` on a side.
Image ReadPng(const std::string& path, std::string_view what, int maxSide);

// Writes through a temporary file beside `path` that replaces `path` only
// once complete, so a failure never leaves a partial PNG. RenderError naming
// the path on failure.
void WritePng(const std::string& path, const Image& image);

}  // namespace Glimmer::RenderTool
