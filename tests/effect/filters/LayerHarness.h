#pragma once
// Small masks drawn as text pictures, and a one-call run of a layer's
// post-processing. Drawn into a transparent image in white, a layer's 8-bit
// plane comes back unchanged as the image's alpha (both blend modes the
// filters use), so tests read the filter's output from LayerAlpha().

#include <cstdint>
#include <string>
#include <vector>

#include "effect/GxECoreBase.h"
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

inline std::vector<uint8_t> Bytes(const GxBitmap& mask) {
    return std::vector<uint8_t>(mask.pixels, mask.pixels + size_t(mask.width) * mask.height);
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

}  // namespace Glimmer::Testing
