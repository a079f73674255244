#pragma once
// Helpers for the filter tests: small masks drawn as text pictures, one-call
// runs of a layer's post-processing, and a glyph canvas for reading whole
// pixels back. Drawn into a transparent image in white, a layer's 8-bit
// plane comes back unchanged as the image's alpha (both blend modes the
// filters use), so plane tests read the filter's output from LayerAlpha().

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer::Testing {

inline constexpr unsigned kWhite = 0xFFFFFFFFu;

// '#' 255, '+' 128, '1'..'9' themselves, anything else 0; rows of equal length.
inline GxBitmap MaskFromPicture(const std::vector<std::string>& rows) {
    GxBitmap mask(unsigned(rows[0].size()), unsigned(rows.size()), 1);
    size_t i = 0;
    for (const std::string& row : rows) {
        for (char c : row) {
            mask.pixels[i++] = c == '#' ? 255 : c == '+' ? 128 : (c >= '1' && c <= '9') ? uint8_t(c - '0') : 0;
        }
    }
    return mask;
}

inline void FillRect(GxBitmap& mask, int left, int top, int right, int bottom, uint8_t v) {
    for (int y = top; y < bottom; ++y)
        for (int x = left; x < right; ++x) mask.pixels[size_t(y) * mask.width + size_t(x)] = v;
}

inline bool SamePixels(const GxBitmap& a, const GxBitmap& b) {
    const size_t bytes = size_t(a.width) * a.height * a.bytesPerPixel;
    return a.width == b.width && a.height == b.height && std::memcmp(a.pixels, b.pixels, bytes) == 0;
}

inline std::vector<uint8_t> Alpha(const GxBitmap& image) {
    std::vector<uint8_t> a(size_t(image.width) * image.height);
    for (size_t i = 0; i < a.size(); ++i) a[i] = image.pixels[i * 4 + 3];
    return a;
}

inline void RunLayer(GxECoreBase& layer, GxBitmap& mask, GxBitmap& dst, GxRect rect, int separate = 0,
                     GxBitmap* extra = nullptr) {
    GxECore::ParamPostProcessing pp{&dst, &mask, &rect, separate, extra};
    layer.doPostProcessing(&pp);
}

// Alpha of what `layer` draws over `mask` (text box `rect`) into a
// transparent image of the mask's size.
inline std::vector<uint8_t> LayerAlpha(GxECoreBase& layer, GxBitmap& mask, GxRect rect, int separate = 0) {
    GxBitmap dst(mask.width, mask.height, 4);
    RunLayer(layer, mask, dst, rect, separate);
    return Alpha(dst);
}

// Rows [top, bottom) x columns [left, right) of a plane `width` wide.
inline std::vector<std::vector<int>> Window(const std::vector<uint8_t>& a, int width, int left, int top,
                                            int right, int bottom) {
    std::vector<std::vector<int>> rows;
    for (int y = top; y < bottom; ++y) rows.emplace_back(a.begin() + y * width + left, a.begin() + y * width + right);
    return rows;
}
using Rows = std::vector<std::vector<int>>;

// Null parameters, no mask, a reversed box, and a layer without a record:
// true when none of them drew anything.
template <typename Layer>
bool BadCallsDrawNothing(Layer& configured, GxBitmap& mask, GxRect rect, GxRect reversed) {
    GxBitmap dst(mask.width, mask.height, 4);
    configured.doPostProcessing(nullptr);
    GxECore::ParamPostProcessing noSrc{&dst, nullptr, &rect, 0, nullptr};
    configured.doPostProcessing(&noSrc);
    RunLayer(configured, mask, dst, reversed);
    Layer unset;
    RunLayer(unset, mask, dst, rect);
    for (uint8_t v : Alpha(dst))
        if (v != 0) return false;
    return true;
}

// A glyph mask, a destination image and a glyph box, run through one
// layer in the normal mode; pixels read back whole.
using Px = std::array<int, 4>;  // R, G, B, A as stored

inline GxGradient Stop(uint32_t color, float position) {
    GxGradient s;
    s.color = color;
    s.position = position;
    return s;
}

struct LayerCanvas {
    GxBitmap mask, dst;
    GxRect box;

    LayerCanvas(int w, int h) : mask(w, h, 1), dst(w, h, 4), box(0, 0, w, h) {}

    // Covers [x0, x1) x [y0, y1) and makes that the glyph box.
    LayerCanvas& Glyph(int x0, int y0, int x1, int y1) {
        for (int y = y0; y < y1; ++y) std::memset(mask.pixels + size_t(y) * mask.width + x0, 255, size_t(x1 - x0));
        box = GxRect(x0, y0, x1, y1);
        return *this;
    }

    LayerCanvas& Run(GxECoreBase& layer) {
        RunLayer(layer, mask, dst, box);
        return *this;
    }

    Px At(int x, int y) const {
        const uint8_t* p = dst.pixels + (size_t(y) * dst.width + x) * 4;
        return {p[0], p[1], p[2], p[3]};
    }

    bool Untouched() const {
        for (size_t i = 0; i < size_t(dst.width) * dst.height * 4; ++i)
            if (dst.pixels[i] != 0) return false;
        return true;
    }
    bool SameAs(const LayerCanvas& o) const { return SamePixels(dst, o.dst); }
};

}  // namespace Glimmer::Testing
