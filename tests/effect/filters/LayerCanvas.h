#pragma once
// A glyph mask, a destination image and a glyph box, run through one layer's
// post-processing as the effect stack does it in its normal mode.

#include <array>
#include <cstdint>
#include <cstring>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer::testing {

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
        GxECore::ParamPostProcessing pp{&dst, &mask, &box, 0, nullptr};
        layer.doPostProcessing(&pp);
        return *this;
    }

    Px At(int x, int y) const {
        const uint8_t* p = dst.pixels + (size_t(y) * dst.width + x) * 4;
        return {p[0], p[1], p[2], p[3]};
    }
    int Alpha(int x, int y) const { return At(x, y)[3]; }

    bool Untouched() const {
        for (size_t i = 0; i < size_t(dst.width) * dst.height * 4; ++i)
            if (dst.pixels[i] != 0) return false;
        return true;
    }
    bool SameAs(const LayerCanvas& o) const {
        return std::memcmp(dst.pixels, o.dst.pixels, size_t(dst.width) * dst.height * 4) == 0;
    }
    // Mirror images about the vertical and the horizontal centre line.
    bool Symmetric() const {
        const int w = int(dst.width), h = int(dst.height);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                if (At(x, y) != At(w - 1 - x, y) || At(x, y) != At(x, h - 1 - y)) return false;
        return true;
    }
};

}  // namespace Glimmer::testing
