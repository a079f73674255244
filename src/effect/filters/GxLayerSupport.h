#pragma once
// Plumbing shared by the glow and fill layers: the glyph box they may read,
// and malloc'd work buffers that free themselves on every way out.

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <memory>

#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer {

struct FreeDeleter {
    void operator()(void* p) const { std::free(p); }
};

template <typename T>
using WorkBuffer = std::unique_ptr<T[], FreeDeleter>;

// `count` elements of T, uninitialised (or zeroed); null when the size does not
// fit or no memory is left.
template <typename T>
WorkBuffer<T> AllocateWork(size_t count, bool zeroed = false) {
    if (count == 0) count = 1;
    if (count > SIZE_MAX / sizeof(T)) return WorkBuffer<T>();
    void* p = zeroed ? std::calloc(count, sizeof(T)) : std::malloc(count * sizeof(T));
    return WorkBuffer<T>(static_cast<T*>(p));
}

// The stack hands over a glyph box already clamped to the mask; the layers
// clamp it again so that a hand-made box can never make them read outside
// the mask. False when nothing of the box lies on the mask (or the mask is
// not an 8-bit image).
inline bool ClipBoxToMask(const GxRect& box, const GxBitmap& mask, GxRect* out) {
    if (mask.pixels == nullptr || mask.bytesPerPixel != 1) return false;
    if (mask.width > uint32_t(INT32_MAX) || mask.height > uint32_t(INT32_MAX)) return false;
    const int32_t w = int32_t(mask.width), h = int32_t(mask.height);
    auto clamp = [](int32_t v, int32_t hi) { return v < 0 ? 0 : (v > hi ? hi : v); };
    out->left = clamp(box.left, w);
    out->top = clamp(box.top, h);
    out->right = clamp(box.right, w);
    out->bottom = clamp(box.bottom, h);
    return out->right > out->left && out->bottom > out->top;
}

}  // namespace Glimmer
