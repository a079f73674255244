// Bevel
//
// The bevel makes the text look raised: a height field is built from the
// distance to the glyph edge, lit by a directional light, and the lit and the
// shaded slopes become two colour washes that are blended over the target.
// Style 1 bevels the inside of the glyphs (the height climbs from the edge
// inward); any other style bevels a collar outside them.
//
// All work happens in a private frame: the text rectangle grown by a margin
// M = Rd + max(2 Rs, 2 soften), where, with r = int(size),
//   smooth technique (0): Rs = ceil(2r / 3 + 1) (a real division: size 14
//                         gives 11), Rd = Rs, colouring gain 1.83;
//   hard technique:       Rs = 0, Rd = r + 2, gain 1.0.
// Passes, in order:
//  1. Light: t = (180 - angle) * 3.14159 / 180, a = altitude * 3.14159 / 180;
//     L = (cos t cos a, sin t cos a, sin a), the first two negated when the
//     direction is 0; normalZ = 2.4 / max(depth, 0.1).
//  2. Height field D, saturated at Rd, one of two ways:
//     - exact (smooth and Rd >= 11): the glyph pixels are far (inside style)
//       or zero (outside style), everything else the opposite; the squared
//       Euclidean transform runs down the columns, then along the rows; values
//       become 0, fsqrt(v), or Rd beyond Rd^2. The glyph test covers the text
//       rectangle plus one column and one row past its right and bottom edges,
//       deliberately (those read the mask as a packed buffer would).
//     - local search: coverage becomes an edge fraction (byte / 254.99), the
//       anti-aliased edge pixels keep 1 - f, and every other pixel takes the
//       nearest v + sqrt(dx^2 + dy^2) within Rd (GxRelief's local search).
//  3. Lighting of every pixel but the frame's outer ring: flat pixels (D = Rd
//     exactly) are skipped; the slope (central differences) gives a level
//     0..255, taken as is inside and as 255 - level outside, and the two
//     planes receive alpha-scaled amounts faded by the edge factor of Rd - D.
//     The scalings are deliberately asymmetric: int(V + 1) for the second
//     plane, 256 - int(V) for the first.
//  4. Smooth technique: both planes blurred with Rs; soften >= 1: blurred
//     again with soften; the buffers rotate as GxRelief describes, outer
//     strips included.
//  5. Colouring: the stronger wash (after the gain, truncated) wins; the pixel
//     is its colour premultiplied by the difference, at most 255; a tie takes
//     the second colour with alpha 0. Flat regions fill both planes alike and
//     cancel here.
//  6. The frame is blended into the destination with mode 1 in the separate-
//     work-image mode and mode 2 otherwise.
// The second wash, the one on the slopes that face the light, takes the
// record's highlight colour, the first its shadow colour; only their alpha and
// colour bytes are used (the float opacities are already folded into them by
// the stack).

#include "effect/filters/GxBevel.h"

#include <cmath>
#include <cstdlib>
#include <cstring>

#include "effect/GxEffectMath.h"
#include "effect/filters/GxReliefRows.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

constexpr float kFar = 1e20f;  // bits 0x60AD78EC
constexpr int kExactFromRange = 11;

}  // namespace

GxBevel::GxBevel() { style = GxECore::kBevel; }

int32_t GxBevel::getOffset() {
    int pixels = 0;
    if (property == nullptr || !ReliefSizePixels(property->size, &pixels)) return 0;
    const int offset = ReliefSoften(property->soften) + EffectMath::TruncToInt(property->size + 0.5f);
    return offset > 0 ? offset : 0;  // a negative size asks for no margin
}

GxBevelGeometry GxBevel::geometry(const GxBevelProperty& property) {
    GxBevelGeometry g;
    if (!ReliefSizePixels(property.size, &g.size)) return g;
    g.soften = ReliefSoften(property.soften);
    g.smooth = property.technique == 0;
    g.smoothRadius = g.smooth ? int(std::ceil(float(2 * g.size) / 3.0f + 1.0f)) : 0;
    g.range = g.smooth ? g.smoothRadius : g.size + 2;
    const int spread = 2 * g.smoothRadius > 2 * g.soften ? 2 * g.smoothRadius : 2 * g.soften;
    g.margin = g.range + spread;
    g.exact = g.smooth && g.range >= kExactFromRange;
    g.gain = g.smooth ? kBevelVariant.smoothGain : 1.0f;
    // Sizes below zero follow the same arithmetic while it stays inside the
    // frame: a negative range only empties the search windows. A negative
    // margin would put the text outside its own frame, and a negative
    // smoothing radius would blur outside the planes: those draw nothing.
    g.drawable = g.margin >= 0 && g.smoothRadius >= 0;
    return g;
}

int GxBevel::partialDT(void* raw) {
    auto* job = static_cast<DistanceJob*>(raw);
    if (job == nullptr) return 0;
    return ReliefLocalDistance(job->field, job->width, job->height, job->radius, job->y0, job->y1,
                               GxReliefTargets::kNonZero, job->scratch);
}

int GxBevel::partialLightProcess(void* raw) {
    auto* job = static_cast<LightJob*>(raw);
    if (job == nullptr || job->field == nullptr || job->x0 >= job->x1) return 0;
    ReliefRows::Light light;
    light.x = job->lightX;
    light.y = job->lightY;
    light.z = job->lightZ;
    light.normalZ = job->normalZ;
    light.range = float(job->range);
    light.secondAlpha = job->secondAlpha;
    light.firstAlpha = job->firstAlpha;
    light.inside = job->inside;
    const ReliefRows::BevelLightRow row = ReliefRows::Active().bevelLight;
    const ptrdiff_t stride = job->stride;
    for (int y = job->y0; y < job->y1; ++y) {
        const ptrdiff_t i = ptrdiff_t(y) * stride + job->x0;
        row(job->field + i, stride, job->x1 - job->x0, light, job->secondPlane + i, job->firstPlane + i);
    }
    return 0;
}

void GxBevel::doPostProcessing(GxECore::ParamPostProcessing* pp) {
    if (property == nullptr || pp == nullptr || pp->dst == nullptr || pp->src == nullptr ||
        pp->src->pixels == nullptr || pp->textRect == nullptr) {
        return;
    }
    const GxBevelProperty& prop = *property;
    const GxBevelGeometry g = geometry(prop);
    if (!g.drawable) return;

    const GxReliefLight light = ReliefLightVector(prop.angle, prop.altitude, prop.direction);
    const float normalZ = ReliefNormalZ(prop.depth, kBevelVariant.depthFloor);

    const GxRect& text = *pp->textRect;
    GxReliefFrame frame;
    if (!ReliefPlanFrame(text, g.margin, &frame)) return;
    const int W = frame.width;
    const int H = frame.height;
    const int M = frame.margin;
    const size_t stride = size_t(W);
    const size_t N = frame.pixels;

    // The field, later the frame's words; the two planes and the blurs' spare.
    GxScratch* scratch = pp->scratch;
    GxReliefBuffer fieldMemory(scratch, GxScratch::kPlaneA);
    GxReliefBuffer planeMemory(scratch, GxScratch::kPlaneB);
    GxReliefBuffer rowMemory(scratch, GxScratch::kRows);
    const bool blurs = g.smooth || g.soften >= 1;
    float* field = fieldMemory.get<float>(N);
    unsigned char* planeBytes = planeMemory.get<unsigned char>(N * (blurs ? 3 : 2));
    if (field == nullptr || planeBytes == nullptr) return;

    const bool inside = prop.style == 1;
    const GxBitmap& mask = *pp->src;
    if (g.exact) {
        const float glyphValue = inside ? kFar : 0.0f;
        const float otherValue = inside ? 0.0f : kFar;
        // Glyph pixels: rows and columns M .. size - M, both ends included.
        const int last = W - M < W - 1 ? W - M : W - 1;
        unsigned char* bytes = rowMemory.get<unsigned char>(stride);
        if (bytes == nullptr) return;
        for (int y = 0; y < H; ++y) {
            float* row = field + size_t(y) * stride;
            for (int x = 0; x < W; ++x) row[x] = otherValue;
            if (y < M || y > H - M || last < M) continue;
            ReliefMaskRow(mask, int64_t(frame.x0) + M, int64_t(frame.y0) + y, last - M + 1, bytes);
            for (int x = M; x <= last; ++x)
                if (bytes[x - M] != 0) row[x] = glyphValue;
        }
        // Past the range every value becomes the range: the transform is
        // needed exactly only up to range^2.
        if (!ReliefExactTransformNear(field, W, H, g.range, scratch)) return;
        const float rangeSquared = float(int64_t(g.range) * g.range);
        for (size_t i = 0; i < N; ++i) {
            const float v = field[i];
            field[i] = v <= 0.0f ? 0.0f : (v > rangeSquared ? float(g.range) : fsqrt(v));
        }
    } else {
        // The starting value of every coverage byte, as the per-pixel rule gives it.
        float start[256];
        for (int m = 0; m < 256; ++m) {
            const float f = float(inside ? m ^ 255 : m) / kBevelVariant.coverageScale;
            start[m] = f <= 0.001f ? float(g.range) : (f < 1.0f ? 1.0f - f : 0.0f);
        }
        const float fill = inside ? 0.0f : float(g.range);
        for (size_t i = 0; i < N; ++i) field[i] = fill;
        const int textWidth = text.right - text.left;
        const int textHeight = text.bottom - text.top;
        unsigned char* bytes = rowMemory.get<unsigned char>(size_t(textWidth > 0 ? textWidth : 1));
        if (bytes == nullptr) return;
        for (int j = 0; j < textHeight; ++j) {
            float* row = field + size_t(M + j) * stride + size_t(M);
            ReliefMaskRow(mask, text.left, int64_t(text.top) + j, textWidth, bytes);
            for (int i = 0; i < textWidth; ++i) row[i] = start[bytes[i]];
        }
        DistanceJob job{field, H, W, g.range, 0, H, scratch};
        partialDT(&job);
    }

    // The lighting leaves the frame's outer ring and flat pixels as they are: zero.
    std::memset(planeBytes, 0, 2 * N);
    GxReliefPlanes planes;
    planes.Use(planeBytes, planeBytes + N, blurs ? planeBytes + 2 * N : nullptr);
    LightJob lightJob{planes.second, planes.first, W, g.range, normalZ, light.x, light.y, light.z,
                      int(ReliefSecondColour(prop) >> 24), int(ReliefFirstColour(prop) >> 24), inside, field,
                      1, W - 1, 1, H - 1};
    partialLightProcess(&lightJob);

    if (!ReliefSmoothAndSoften(&planes, W, H, g.smooth, g.smoothRadius, g.soften, scratch)) return;

    uint32_t* argb = fieldMemory.get<uint32_t>(N);  // the field's memory, no longer needed
    if (argb == nullptr) return;
    ReliefColourise(planes.first, planes.second, N, g.gain, ReliefFirstColour(prop), ReliefSecondColour(prop),
                    argb);
    ReliefDrawFrame(kBevelVariant, frame, argb, pp->separateWorkImage, pp->dst, pp->extraDst);
}

}  // namespace Glimmer
