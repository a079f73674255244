#pragma once

#include <cstddef>
#include <cstdint>

#include "foundation/GxRect.h"

namespace Glimmer {

// A packed image: width x height pixels of bytesPerPixel bytes, no row padding.
// 1 byte per pixel is an 8-bit coverage mask (format 2); 4 bytes is 32-bit
// colour (format 1), R, G, B, A in memory, premultiplied while the engine works.
//
// Constructors never fail loudly: when the pixel block cannot be had (no
// memory, or a size product that does not fit) `pixels` stays null with the
// size fields set, and every user tests `pixels` before touching it.
class GxBitmap {
public:
    enum Format : uint32_t { kFormatColor32 = 1, kFormatOther = 2 };

    GxBitmap();
    GxBitmap(unsigned width, unsigned height, unsigned bytesPerPixel);
    // Copies `data`; the caller keeps its buffer.
    GxBitmap(unsigned width, unsigned height, unsigned char* data, unsigned bytesPerPixel);
    GxBitmap(const GxBitmap& other);
    // Cuts a sub-image one byte per pixel, whatever the depth: meant for 8-bit
    // masks. The rectangle must lie inside the source.
    GxBitmap(const GxBitmap& source, GxRect* rect);
    GxBitmap& operator=(const GxBitmap& other);
    virtual ~GxBitmap();

    // Bytes in a pixel block of that size; false when the product does not fit
    // an int32, the largest block the library agrees to allocate.
    static bool PixelBytes(unsigned width, unsigned height, unsigned bytesPerPixel, size_t* bytes);

    uint32_t width = 0;
    uint32_t height = 0;
    unsigned char* pixels = nullptr;
    // Deliberately 4 for a default-constructed bitmap, next to 0 bytes per pixel.
    uint32_t format = 4;
    uint32_t bytesPerPixel = 0;

private:
    void AllocateCopy(const unsigned char* data);
};

}  // namespace Glimmer
