#pragma once
// Masks, canvases and records for the bevel and emboss tests.

#include <cstdint>
#include <cstring>
#include <random>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer::Testing {

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
        GxECore::ParamPostProcessing pp{&dst, &mask, &rect, separateWorkImage, extra};
        layer.doPostProcessing(&pp);
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

inline bool SamePixels(const GxBitmap& a, const GxBitmap& b) {
    const size_t bytes = size_t(a.width) * a.height * a.bytesPerPixel;
    return a.width == b.width && a.height == b.height && std::memcmp(a.pixels, b.pixels, bytes) == 0;
}

}  // namespace Glimmer::Testing
