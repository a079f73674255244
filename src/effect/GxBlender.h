#pragma once
// The pixel compositor. Every layer ends in one of these calls; nothing else
// in the engine writes colour into a 32-bit image.
//
// 32-bit images are bytes R, G, B, A in memory, premultiplied; colour
// arguments are 0xAARRGGBB words. Products of a byte and a weight are always
// (value + 1) * weight >> 8 (never a division by 255), and sums are clamped to
// 255 per channel. The destination's pixel block is written although the
// bitmap pointer is const. Null destinations, null pixel blocks, null sources
// and empty clips are no-ops; nothing is reported.
//
// Clipping (every operation): columns max(x, 0) <= c < min(x + w, dst width),
// rows likewise; the source is entered at (-x, -y) when those are negative.

#include <cstdint>

#include "foundation/GxBitmap.h"

namespace Glimmer {

enum GxEBlendMode : int {
    GxE_BLEND_SRC_OVER = 1,
    GxE_BLEND_DST_OVER = 2,
    GxE_BLEND_DST_OVER_NSA = 3,  // destination-over, coverage only switches on/off
    GxE_BLEND_OTHER = 7,         // destination-over with coverage as alpha (text layer)
};

class GxBlender {
public:
    GxBlender() {}
    virtual ~GxBlender() {}

    // 8-bit coverage sources. Source row r starts at r * stride.
    // Modes 1, 2, 3 and 7 (GxEBlendMode); any other mode draws nothing.
    static void drawBitmapBlend8(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                 int w, int h, int stride, unsigned color, int mode);
    static void blendSrcOver8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, unsigned color);
    static void blendDstOver8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, unsigned color);
    static void blendDstOver8To32NSA(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                     int w, int h, int stride, unsigned color);
    static void blendDstOverSA8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                    int w, int h, int stride, unsigned color);

    // 8-bit sources without a stride (rows of w bytes). Into a 4-byte
    // destination as drawBitmap8To32, into anything else as drawBitmap8To8.
    static void drawBitmap(int x, int y, const GxBitmap* dst, const unsigned char* src,
                           int w, int h, unsigned color);
    static void drawBitmap(int x, int y, const GxBitmap* dst, const GxBitmap* src, unsigned color);
    // Overwrites with (R, G, B, coverage-scaled A): colour deliberately unscaled.
    static void drawBitmap8To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                int w, int h, unsigned color);
    // Union of coverage: D = max(D, m).
    static void drawBitmap8To8(int x, int y, const GxBitmap* dst, const unsigned char* src,
                               int w, int h);

    // 32-bit sources. Rows are w pixels apart; `stride` is accepted for the
    // callers' symmetry with the 8-bit forms and not used.
    // Words 0xAARRGGBB: mode 1 source-over, mode 2 destination-over, else nothing.
    static void drawBitmapBlend32(int x, int y, const GxBitmap* dst, const unsigned* src,
                                  int w, int h, int stride, int mode);
    // Bytes R, G, B, A (the engine's own image layout): always destination-over.
    static void drawBitmapBlend32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                  int w, int h, int stride, int ignored, int flag);
    static void blendSrcOver32To32(int x, int y, const GxBitmap* dst, const unsigned* src,
                                   int w, int h, int stride);
    static void blendDstOver32To32(int x, int y, const GxBitmap* dst, const unsigned* src,
                                   int w, int h, int stride);
    // `flag` non-zero: a transparent destination pixel takes the source as it
    // is (as the word form does). Zero: it goes through the general sum, so
    // colour left under alpha 0 is kept and added to.
    static void blendDstOver32To32(int x, int y, const GxBitmap* dst, const unsigned char* src,
                                   int w, int h, int stride, int flag);

    // Memory order R, G, B, A to the little-endian word 0xAARRGGBB, in place.
    static void convertBGRAToARGB(GxBitmap* bitmap);
};

}  // namespace Glimmer
