#include "foundation/GxBitmap.h"

#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace Glimmer {

namespace {
uint32_t FormatFor(unsigned bytesPerPixel) {
    return bytesPerPixel == 4 ? GxBitmap::kFormatColor32 : GxBitmap::kFormatOther;
}

// malloc of a size that may be 0; a zero-byte block is still a valid bitmap.
unsigned char* AllocatePixels(size_t bytes) {
    return static_cast<unsigned char*>(std::malloc(bytes == 0 ? 1 : bytes));
}
}  // namespace

bool GxBitmap::PixelBytes(unsigned width, unsigned height, unsigned bytesPerPixel, size_t* bytes) {
    // Three factors below 2^32 each: checked in two steps so nothing wraps.
    uint64_t area = uint64_t(width) * height;
    if (bytesPerPixel != 0 && area > uint64_t(INT32_MAX) / bytesPerPixel) return false;
    *bytes = size_t(area * bytesPerPixel);
    return true;
}

GxBitmap::GxBitmap() = default;

GxBitmap::GxBitmap(unsigned w, unsigned h, unsigned bpp)
    : width(w), height(h), format(FormatFor(bpp)), bytesPerPixel(bpp) {
    size_t bytes = 0;
    if (!PixelBytes(w, h, bpp, &bytes)) return;
    pixels = AllocatePixels(bytes);
    if (pixels != nullptr) std::memset(pixels, 0, bytes);
}

GxBitmap::GxBitmap(unsigned w, unsigned h, unsigned char* data, unsigned bpp)
    : width(w), height(h), format(FormatFor(bpp)), bytesPerPixel(bpp) {
    AllocateCopy(data);
}

GxBitmap::GxBitmap(const GxBitmap& other)
    : width(other.width), height(other.height), format(other.format),
      bytesPerPixel(other.bytesPerPixel) {
    AllocateCopy(other.pixels);
}

GxBitmap::GxBitmap(const GxBitmap& source, GxRect* rect)
    : format(source.format), bytesPerPixel(source.bytesPerPixel) {
    if (rect == nullptr) return;
    width = uint32_t(rect->Width());
    height = uint32_t(rect->Height());
    size_t bytes = 0;
    if (!PixelBytes(width, height, bytesPerPixel, &bytes)) return;
    pixels = AllocatePixels(bytes);
    size_t sourceBytes = 0;
    if (pixels == nullptr || source.pixels == nullptr ||
        !PixelBytes(source.width, source.height, source.bytesPerPixel, &sourceBytes)) {
        return;
    }
    // The rectangle is meant to lie inside the source and is not clipped; a
    // byte it names outside the source's block is skipped rather than read.
    for (int32_t y = rect->top; y < rect->bottom; ++y) {
        for (int32_t x = rect->left; x < rect->right; ++x) {
            const int64_t from = int64_t(x) + int64_t(y) * source.width;
            if (from < 0 || uint64_t(from) >= sourceBytes) continue;
            pixels[size_t(int64_t(x) - rect->left) + size_t(int64_t(y) - rect->top) * width] =
                source.pixels[from];
        }
    }
}

GxBitmap& GxBitmap::operator=(const GxBitmap& other) {
    if (this == &other) return *this;
    width = other.width;
    height = other.height;
    format = other.format;
    bytesPerPixel = other.bytesPerPixel;
    std::free(pixels);
    pixels = nullptr;
    AllocateCopy(other.pixels);
    return *this;
}

GxBitmap::~GxBitmap() { std::free(pixels); }

void GxBitmap::AllocateCopy(const unsigned char* data) {
    pixels = nullptr;
    size_t bytes = 0;
    if (!PixelBytes(width, height, bytesPerPixel, &bytes)) return;
    pixels = AllocatePixels(bytes);
    if (pixels == nullptr) return;
    if (data != nullptr) {
        std::memcpy(pixels, data, bytes);
    } else {
        std::memset(pixels, 0, bytes);  // nothing to copy from: never hand out garbage
    }
}

}  // namespace Glimmer
