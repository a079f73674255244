#pragma once
// Helpers for the filter tests: small masks drawn as text pictures, one-call
// runs of a layer's post-processing, a glyph canvas for reading whole pixels
// back, and the records and canvases of the bevel and emboss tests. Drawn
// into a transparent image in white, a layer's 8-bit plane comes back
// unchanged as the image's alpha (both blend modes the filters use), so
// plane tests read the filter's output from LayerAlpha().

#include <gtest/gtest.h>

#include <array>
#include <cstdint>
#include <cstring>
#include <random>
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

inline std::vector<uint8_t> Bytes(const GxBitmap& mask) {
    return std::vector<uint8_t>(mask.pixels, mask.pixels + size_t(mask.width) * mask.height);
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
    int Alpha(int x, int y) const { return At(x, y)[3]; }

    bool Untouched() const {
        for (size_t i = 0; i < size_t(dst.width) * dst.height * 4; ++i)
            if (dst.pixels[i] != 0) return false;
        return true;
    }
    bool SameAs(const LayerCanvas& o) const { return SamePixels(dst, o.dst); }
    // Mirror images about the vertical and the horizontal centre line.
    bool Symmetric() const {
        const int w = int(dst.width), h = int(dst.height);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                if (At(x, y) != At(w - 1 - x, y) || At(x, y) != At(x, h - 1 - y)) return false;
        return true;
    }
};

// --- bevel and emboss: records, canvases and readings

struct ReliefParams {
    int style = 1;
    float depth = 1.0f;
    float size = 5.0f;
    int direction = 1;
    int technique = 0;
    int soften = 0;
    float angle = 120.0f;
    float altitude = 30.0f;
    uint32_t first = 0xFFFF0000;   // the first wash (the record's shadow colour): red
    uint32_t second = 0xFF0000FF;  // the second wash (its highlight colour): blue
};

inline ReliefParams Relief(int style, int technique, float size, int soften = 0) {
    ReliefParams p;
    p.style = style;
    p.technique = technique;
    p.size = size;
    p.soften = soften;
    return p;
}

template <typename Record>
Record MakeRecord(const ReliefParams& p) {
    return Record(p.style, p.depth, p.size, p.direction, p.technique, p.soften, 1.0f, p.angle,
                  p.altitude, p.second, 1.0f, p.first, 1.0f);
}

// A mask and a 32-bit target of the same size, with the text rectangle
// `pad` pixels in from every side.
struct ReliefCanvas {
    ReliefCanvas(int textWidth, int textHeight, int pad)
        : mask(textWidth + 2 * pad, textHeight + 2 * pad, 1),
          dst(textWidth + 2 * pad, textHeight + 2 * pad, 4),
          rect(pad, pad, pad + textWidth, pad + textHeight) {}

    // Runs a fresh Layer with a Record built from `p`.
    template <typename Layer, typename Record>
    void Run(const ReliefParams& p, int separateWorkImage = 0, GxBitmap* extra = nullptr) {
        Record record = MakeRecord<Record>(p);
        Layer layer;
        layer.setProperty(&record);
        RunLayer(layer, mask, dst, rect, separateWorkImage, extra);
    }

    uint8_t& Mask(int x, int y) { return mask.pixels[size_t(y) * mask.width + size_t(x)]; }
    const uint8_t* Pixel(int x, int y) const { return dst.pixels + (size_t(y) * dst.width + size_t(x)) * 4; }
    size_t DstBytes() const { return size_t(dst.width) * dst.height * 4; }
    int DrawnPixels() const {
        int n = 0;
        for (size_t i = 3; i < DstBytes(); i += 4) n += dst.pixels[i] != 0;
        return n;
    }
    // Copies rows of text-rectangle coverage in.
    template <size_t W, size_t H>
    void SetText(const uint8_t (&rows)[H][W]) {
        for (size_t y = 0; y < H; ++y)
            for (size_t x = 0; x < W; ++x) Mask(rect.left + int(x), rect.top + int(y)) = rows[y][x];
    }

    // Full coverage `inset` pixels in from the text rectangle's sides, with a
    // one-pixel rim of 128; pixels past the canvas are left out.
    void FillSquare(int inset) {
        auto set = [&](int x, int y, uint8_t v) {
            if (x >= 0 && y >= 0 && x < int(mask.width) && y < int(mask.height)) Mask(x, y) = v;
        };
        for (int y = rect.top + inset - 1; y < rect.bottom - inset + 1; ++y)
            for (int x = rect.left + inset - 1; x < rect.right - inset + 1; ++x) set(x, y, 128);
        for (int y = rect.top + inset; y < rect.bottom - inset; ++y)
            for (int x = rect.left + inset; x < rect.right - inset; ++x) set(x, y, 255);
    }

    // Random blobs with anti-aliased edges, symmetric under a half turn about
    // the canvas centre.
    void FillPointSymmetric(unsigned seed) {
        std::mt19937 rng(seed);
        const int w = rect.right - rect.left;
        const int h = rect.bottom - rect.top;
        for (int j = 0; j < h; ++j) {
            for (int i = 0; i < w; ++i) {
                const int mi = w - 1 - i, mj = h - 1 - j;
                if (j * w + i > mj * w + mi) continue;
                const unsigned r = rng() % 8;
                const uint8_t v = r < 3 ? 0 : (r < 6 ? 255 : uint8_t(1 + rng() % 254));
                Mask(rect.left + i, rect.top + j) = v;
                Mask(rect.left + mi, rect.top + mj) = v;
            }
        }
    }

    GxBitmap mask;
    GxBitmap dst;
    GxRect rect;
};

// A pixel as a signed alpha, for opaque red first and opaque blue second
// colours: +a is red at alpha a (premultiplied (a, 0, 0, a)), -a blue, 0
// transparent, 1000 anything else.
inline int SignedAlpha(const uint8_t* px) {
    if (px[0] == 0 && px[1] == 0 && px[2] == 0 && px[3] == 0) return 0;
    if (px[0] == px[3] && px[1] == 0 && px[2] == 0) return px[3];
    if (px[2] == px[3] && px[0] == 0 && px[1] == 0) return -int(px[3]);
    return 1000;
}

// Every pixel of the canvas against a frame of signed alphas.
template <size_t W, size_t H>
void ExpectSignedAlphas(const ReliefCanvas& c, const int (&expect)[H][W]) {
    for (size_t y = 0; y < H; ++y)
        for (size_t x = 0; x < W; ++x) EXPECT_EQ(SignedAlpha(c.Pixel(int(x), int(y))), expect[y][x]) << x << "," << y;
}

// a(x, y) == b(w - 1 - x, h - 1 - y) for every pixel.
inline bool HalfTurnOf(const GxBitmap& a, const GxBitmap& b) {
    if (a.width != b.width || a.height != b.height) return false;
    for (uint32_t y = 0; y < a.height; ++y) {
        for (uint32_t x = 0; x < a.width; ++x) {
            const uint8_t* p = a.pixels + (size_t(y) * a.width + x) * 4;
            const uint8_t* q = b.pixels + (size_t(a.height - 1 - y) * a.width + (a.width - 1 - x)) * 4;
            if (std::memcmp(p, q, 4) != 0) return false;
        }
    }
    return true;
}

}  // namespace Glimmer::Testing
