// Inner shadow: the outside of the glyphs, blurred and moved by the shadow's
// displacement, seen only through the glyphs.
//
// Think of the text as cut into the surface and lit at the shadow's angle:
// the rim on the light's side shades the glyph floor next to it. So the
// inverse of the mask (255 outside the glyphs) is blurred with a separable
// Gaussian of radius R = trunc(size + 0.5) and moved by the same (dx, dy) an
// outer shadow of this angle and distance would get (angle 90: down, so the
// shade lies along the top edges inside the glyphs; angle 0: left, so it
// lies along their right edges). Only glyph pixels keep a value.
//
// Everything happens inside the text rectangle (W x H); nothing is drawn
// outside it, hence a margin of 0.
//
// 1. Fully displaced shadow. When the moved, blurred inverse covers the whole
//    rectangle (dx < -(W + R), dx >= W + R, dy >= H + R or dy < -(H + R): a
//    deliberate mix of strict and non-strict tests), the mask itself is drawn:
//    every glyph pixel shaded at its own coverage.
// 2. Rows: the glyph rows, padded with R zero columns on each side, are
//    blurred along the row as inverse: each work sample is
//    (255 * S - sum of w[|i|] * glyph) / S, taps off the plane counting as
//    empty glyph (full inverse).
// 3. Uncovered parts: result pixels that would read the blurred inverse from
//    beyond the padded plane, after the move, are full shadow (255) without
//    blurring: the first dy - R rows when dy > R, the rows from H + R + dy on
//    when dy < -R, and in the other rows the first dx - R columns when dx > R
//    or the columns from W + R + dx on when dx < -R.
// 4. Columns: result pixel (x, y) reads work column x + R - dx (the padding
//    shifts glyph column x to x + R), centred on work row y - dy. The work
//    plane has 2R rows of 255 above it and 2R + 2 below, so taps above or
//    below the glyph rows read full inverse; the value is (centre * 100 + sum
//    of (above + below) * w[i]) / S, at most 255 (clamped all the same). Every
//    tap of the rows left to this step lands on the plane. Both passes are the
//    shared row kernel of GxBlurRows.
// 5. Glyph pixels keep their value, all other pixels become 0 (the shade
//    lies inside the glyphs, even in the uncovered parts of step 3). The
//    value is not scaled by the glyph's coverage: the compositing scales
//    everything under partly covered pixels once more, when the text is
//    drawn over the shade or the images are merged, so scaling here would
//    count the coverage twice and let the text colour show through the rim
//    of a fully shaded glyph. (The fully displaced case of step 1 does draw
//    coverage-scaled shade; that is its own deliberate rule.)
// 6. The result is drawn destination-over at the rectangle's corner.
//
// Weights: w[0] = 100, the +0.5 of the rounding added in single precision
// (the outer shadow adds it in double precision).

#include "effect/filters/GxInnerShadow.h"

#include <cstdlib>
#include <cstring>
#include <new>

#include "effect/GxBlender.h"
#include "effect/filters/GxFilterLimits.h"
#include "effect/filters/GxBlurRows.h"
#include "effect/filters/GxGaussian.h"
#include "effect/filters/GxLayerSupport.h"
#include "effect/filters/GxShadowGeometry.h"

namespace Glimmer {

namespace {

int64_t Clamp64(int64_t v, int64_t lo, int64_t hi) { return v < lo ? lo : (v > hi ? hi : v); }

}  // namespace

GxInnerShadow::GxInnerShadow() { style = GxECore::kInnerShadow; }

GxInnerShadow::~GxInnerShadow() { delete property; }

void GxInnerShadow::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxOuterShadowProperty*>(p);  // both shadow records share their fields
    if (source == nullptr) return;
    auto* copy = new (std::nothrow) GxInnerShadowProperty(source->angle, source->distance, source->size,
                                                          source->color, source->opacity);
    delete property;
    property = copy;
}

GxProperty* GxInnerShadow::getProperty() { return property; }

int32_t GxInnerShadow::getOffset() { return 0; }

void GxInnerShadow::computeGaussianWeights(int* weights, int* sum, int radius) {
    ComputeGaussianWeights(weights, sum, radius, kShadowGaussianCentre, GaussianRounding::kSingle);
}

void GxInnerShadow::doPostProcessing(GxECore::ParamPostProcessing* p) {
    if (p == nullptr || property == nullptr || p->textRect == nullptr || p->dst == nullptr ||
        p->src == nullptr)
        return;
    const GxBitmap& src = *p->src;
    GxRect rect;
    if (p->dst->pixels == nullptr || !ClipBoxToMask(*p->textRect, src, &rect)) return;

    int R = ShadowRadiusSingle(property->size);
    if (R < 0) R = 0;
    if (R > kMaxFilterRadius) return;
    const ShadowDisplacement d = ComputeShadowDisplacement(property->angle, property->distance);
    const int64_t dx = d.dx, dy = d.dy;
    const int W = rect.right - rect.left;
    const int H = rect.bottom - rect.top;
    const size_t srcStride = src.width;
    const unsigned char* mask = src.pixels + size_t(rect.top) * srcStride + size_t(rect.left);
    const unsigned color = property->color;

    // 1. Fully displaced: the glyphs themselves are the shade.
    if (R + int64_t(rect.right) + dx < rect.left || rect.right <= rect.left - R + dx ||
        R + int64_t(rect.bottom) <= rect.top + dy || rect.bottom + dy < int64_t(rect.top) - R) {
        GxBlender::drawBitmapBlend8(rect.left, rect.top, p->dst, mask, W, H, int(srcStride), color,
                                    GxE_BLEND_DST_OVER);
        return;
    }

    GxGaussian gaussian;
    if (!PlanGaussian(&gaussian, R, kShadowGaussianCentre, GaussianRounding::kSingle)) return;
    const int64_t paddedW64 = int64_t(W) + 2 * int64_t(R);
    // The work plane with 2R rows of full inverse above it and 2R + 2 below.
    const int64_t workH64 = int64_t(H) + 4 * int64_t(R) + 2;
    size_t resultBytes = 0, workBytes = 0;
    if (paddedW64 > INT32_MAX || workH64 > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(W), unsigned(H), 1, &resultBytes) ||
        !GxBitmap::PixelBytes(unsigned(paddedW64), unsigned(workH64), 1, &workBytes))
        return;
    const int Wp = int(paddedW64);
    const size_t rowBytes = size_t(W) + 4 * size_t(R);

    // Work memory: the stack's when it lends it, else our own for this call.
    WorkBuffer<unsigned char> ownResult, ownWork, ownRow;
    unsigned char* res = nullptr;
    unsigned char* work = nullptr;
    unsigned char* row = nullptr;
    if (p->scratch != nullptr) {
        res = p->scratch->get<unsigned char>(GxScratch::kPlaneA, resultBytes);
        work = p->scratch->get<unsigned char>(GxScratch::kPlaneB, workBytes);
        row = p->scratch->get<unsigned char>(GxScratch::kRows, rowBytes, true);
    } else {
        ownResult = AllocateWork<unsigned char>(resultBytes);
        ownWork = AllocateWork<unsigned char>(workBytes);
        ownRow = AllocateWork<unsigned char>(rowBytes, true);
        res = ownResult.get();
        work = ownWork.get();
        row = ownRow.get();
    }
    if (res == nullptr || work == nullptr || row == nullptr) return;
    const BlurRows::BlurRow blur = BlurRows::Active().blurRow;

    // 2. Along the rows, as inverse. The glyph row sits 2R into a row of
    //    zeros, so the taps of every padded column (R zeros either side of the
    //    glyphs) land on the row; work row y is plane row 2R + y.
    std::memset(work, 255, size_t(2 * R) * Wp);
    std::memset(work + size_t(2 * R + H) * Wp, 255, size_t(2 * R + 2) * Wp);
    for (int y = 0; y < H; ++y) {
        std::memcpy(row + 2 * size_t(R), mask + size_t(y) * srcStride, size_t(W));
        blur(row + R, 1, Wp, gaussian, true, work + size_t(2 * R + y) * Wp);
    }

    // 3. Rows [yLo, yHi) x columns [xLo, xHi) read the work plane; the rest
    //    of the result is full shadow.
    const int yLo = int(dy > R ? Clamp64(dy - R, 0, H) : 0);
    const int yHi = int(dy < -R ? Clamp64(H + R + dy, yLo, H) : H);
    const int xLo = int(dx > R ? Clamp64(dx - R, 0, W) : 0);
    const int xHi = int(dx < -R ? Clamp64(W + R + dx, xLo, W) : W);
    std::memset(res, 255, size_t(yLo) * W);
    std::memset(res + size_t(yHi) * W, 255, size_t(H - yHi) * W);
    for (int y = yLo; y < yHi; ++y) {
        std::memset(res + size_t(y) * W, 255, size_t(xLo));
        std::memset(res + size_t(y) * W + xHi, 255, size_t(W - xHi));
    }

    // 4. Down the moved columns: result (x, y) is centred on work row y - dy,
    //    column x + R - dx; for y in [yLo, yHi) the taps stay on the plane.
    for (int y = yLo; y < yHi && xLo < xHi; ++y) {
        const unsigned char* centre = work + size_t(2 * R + y - dy) * Wp + size_t(xLo + R - dx);
        blur(centre, Wp, xHi - xLo, gaussian, false, res + size_t(y) * W + xLo);
    }

    // 5. The shade lies inside the glyphs.
    for (int y = 0; y < H; ++y) {
        const unsigned char* g = mask + size_t(y) * srcStride;
        unsigned char* r = res + size_t(y) * W;
        for (int x = 0; x < W; ++x)
            if (g[x] == 0) r[x] = 0;
    }

    // 6.
    GxBlender::drawBitmapBlend8(rect.left, rect.top, p->dst, res, W, H, W, color, GxE_BLEND_DST_OVER);
}

}  // namespace Glimmer
