// Outer shadow: the text mask, blurred and moved away from the light, drawn
// behind whatever is already in the image.
//
// The displacement (dx, dy) comes from the light angle and the distance (see
// GxShadowGeometry.h: angle 0 moves the shadow left, 90 down) and is fixed
// when the property is set. The blur radius is R = trunc(size + 0.5).
//
// The mask's text rectangle is copied into a plane with a frame of M = 2R
// zero pixels on every side. A separable integer Gaussian of radius R
// (weights w[0] = 100 ... w[R] ~ 1, total S) then runs over it, first down
// the columns into a row buffer, then along that row into the output plane:
// each sample is one weighted sum divided by S (the shared row kernel of
// GxBlurRows, exact integer quotients). Only
// samples at least R pixels from the plane's border are computed, so every
// tap stays inside the plane; the outer R pixels on each side stay 0 and the
// inner R of the frame are where the blur spreads beyond the glyphs. The
// plane is drawn destination-over at the text rectangle's corner less M,
// moved by (dx, dy).
//
// Deliberate details, kept: the weights add their +0.5 in double precision
// (the inner shadow adds it in single precision); the radius used for drawing
// adds its 0.5 in double precision while the margins add it in single
// precision; a shadow that cannot touch the image is dropped before anything
// is allocated, by tests that are strict on one side (a plane ending exactly
// at x = 0 is still drawn, and clipped away).

#include "effect/filters/GxOuterShadow.h"

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

// The separable blur. `in` and `out` are W x H planes; rows [R, H - R) and
// columns [R, W - R) of `out` get the blurred value, everything else 0.
// `row` (W bytes) is scratch.
void BlurPlane(const unsigned char* in, unsigned char* out, int W, int H, const GxGaussian& g,
               unsigned char* row) {
    const int R = g.radius;
    if (W < 2 * R || H < 2 * R) return;  // the callers' planes are at least 4R on a side
    const size_t stride = size_t(W);
    const int n = W - 2 * R;
    const BlurRows::BlurRow blur = BlurRows::Active().blurRow;
    std::memset(row, 0, size_t(R));
    std::memset(row + R + n, 0, size_t(R));
    std::memset(out, 0, stride * size_t(R));
    for (int y = R; y < H - R; ++y) {
        // Down the columns into the row, then along the row.
        blur(in + size_t(y) * stride + R, ptrdiff_t(stride), n, g, false, row + R);
        unsigned char* o = out + size_t(y) * stride;
        std::memset(o, 0, size_t(R));
        blur(row + R, 1, n, g, false, o + R);
        std::memset(o + R + n, 0, size_t(R));
    }
    std::memset(out + size_t(H - R) * stride, 0, stride * size_t(R));
}

}  // namespace

GxOuterShadow::GxOuterShadow() { style = GxECore::kOuterShadow; }

GxOuterShadow::~GxOuterShadow() { delete property; }

void GxOuterShadow::setProperty(GxProperty* p) {
    auto* source = dynamic_cast<GxOuterShadowProperty*>(p);
    if (source == nullptr) return;
    auto* copy = new (std::nothrow) GxOuterShadowProperty(source->angle, source->distance, source->size,
                                                          source->color, source->opacity);
    delete property;
    property = copy;
    offsetX = 0;
    offsetY = 0;
    if (property != nullptr) {
        const ShadowDisplacement d = ComputeShadowDisplacement(property->angle, property->distance);
        offsetX = d.dx;
        offsetY = d.dy;
    }
}

GxProperty* GxOuterShadow::getProperty() { return property; }

void GxOuterShadow::computeGaussianWeights(int* weights, int* sum, int radius) {
    ComputeGaussianWeights(weights, sum, radius, kShadowGaussianCentre, GaussianRounding::kDouble);
}

int32_t GxOuterShadow::marginRadius() const {
    if (property == nullptr) return 0;
    const int32_t R = ShadowRadiusSingle(property->size);
    if (R > kMaxFilterRadius) return -1;
    return R < 0 ? 0 : R;
}

// Margin toward a side whose displacement component is `toward` (positive
// when the shadow moves toward that side). R <= 1024 and |d| <= 2^30: no
// overflow.
static int32_t SideMargin(int32_t R, int32_t toward) {
    if (R < 0) return 0;
    if (toward > 0) return R + toward;
    const int32_t rest = R + toward;
    return rest > 0 ? rest : 0;
}

int32_t GxOuterShadow::getLeftOffset() { return SideMargin(marginRadius(), -offsetX); }
int32_t GxOuterShadow::getRightOffset() { return SideMargin(marginRadius(), offsetX); }
int32_t GxOuterShadow::getTopOffset() { return SideMargin(marginRadius(), -offsetY); }
int32_t GxOuterShadow::getBottomOffset() { return SideMargin(marginRadius(), offsetY); }

void GxOuterShadow::doPostProcessing(GxECore::ParamPostProcessing* p) {
    if (p == nullptr || property == nullptr || p->textRect == nullptr || p->dst == nullptr ||
        p->src == nullptr)
        return;
    const GxBitmap& src = *p->src;
    const GxBitmap& dst = *p->dst;
    GxRect rect;
    if (p->dst->pixels == nullptr || !ClipBoxToMask(*p->textRect, src, &rect)) return;

    const int R = ShadowRadiusDouble(property->size);
    if (R > kMaxFilterRadius) return;
    const int M = 2 * R;
    const int64_t dx = offsetX, dy = offsetY;

    // Drop a shadow that cannot touch the image before allocating anything.
    const int64_t x0 = int64_t(rect.left) - M + dx;
    const int64_t y0 = int64_t(rect.top) - M + dy;
    if (int64_t(rect.right) + M + dx < 0 || x0 >= int64_t(dst.width) ||
        int64_t(rect.bottom) + M + dy < 0 || y0 >= int64_t(dst.height))
        return;

    const int64_t planeW = int64_t(rect.right) - rect.left + 2 * int64_t(M);
    const int64_t planeH = int64_t(rect.bottom) - rect.top + 2 * int64_t(M);
    size_t planeBytes = 0;
    if (planeW > INT32_MAX || planeH > INT32_MAX ||
        !GxBitmap::PixelBytes(unsigned(planeW), unsigned(planeH), 1, &planeBytes))
        return;
    const int W = int(planeW), H = int(planeH);

    GxGaussian gaussian;
    if (!PlanGaussian(&gaussian, R, kShadowGaussianCentre, GaussianRounding::kDouble)) return;
    // Work memory: the stack's when it lends it, else our own for this call.
    WorkBuffer<unsigned char> ownSource, ownOutput, ownRow;
    unsigned char* sourcePlane = nullptr;
    unsigned char* outputPlane = nullptr;
    unsigned char* row = nullptr;
    if (p->scratch != nullptr) {
        sourcePlane = p->scratch->get<unsigned char>(GxScratch::kPlaneA, planeBytes);
        outputPlane = p->scratch->get<unsigned char>(GxScratch::kPlaneB, planeBytes);
        row = p->scratch->get<unsigned char>(GxScratch::kRows, size_t(W));
    } else {
        ownSource = AllocateWork<unsigned char>(planeBytes);
        ownOutput = AllocateWork<unsigned char>(planeBytes);
        ownRow = AllocateWork<unsigned char>(size_t(W));
        sourcePlane = ownSource.get();
        outputPlane = ownOutput.get();
        row = ownRow.get();
    }
    if (sourcePlane == nullptr || outputPlane == nullptr || row == nullptr) return;

    // The text rectangle inside a frame of M zeros.
    unsigned char* plane = sourcePlane;
    const int textW = rect.right - rect.left;
    std::memset(plane, 0, size_t(M) * W);
    for (int y = M; y < H - M; ++y) {
        unsigned char* to = plane + size_t(y) * W;
        std::memset(to, 0, size_t(M));
        std::memcpy(to + M, src.pixels + size_t(rect.top + y - M) * src.width + rect.left, size_t(textW));
        std::memset(to + M + textW, 0, size_t(M));
    }
    std::memset(plane + size_t(H - M) * W, 0, size_t(M) * W);

    BlurPlane(plane, outputPlane, W, H, gaussian, row);

    GxBlender::drawBitmapBlend8(int(x0), int(y0), p->dst, outputPlane, W, H, W, property->color,
                                GxE_BLEND_DST_OVER);
}

}  // namespace Glimmer
