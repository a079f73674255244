// Emboss
//
// The emboss makes the text look pressed up out of the surface: the slope
// runs across the glyph edge, rising inside and falling outside, and both
// sides are lit. It is built from the bevel's pieces (GxRelief.h) with a
// different height field and its own constants.
//
// With r = int(size) and h = r * 0.5:
//   hard technique:   outer range Ro = ceil(h + 3), inner range Ri = ceil(h + 1),
//                     no smoothing (Rs = 0), colouring gain 1.0;
//   smooth technique: Ro = Ri = ceil(r * 0.25 + 1), Rs = ceil(h + 1), gain 2.03.
// The frame is the text rectangle grown by M = Ro + max(2 Rs, 2 soften);
// normalZ = 2.4 / max(depth, 0.2) (a floor of 0.2, not the bevel's 0.1).
// Passes:
//  1. Light as the bevel's.
//  2. Height field, one of two ways:
//     - exact (smooth and r >= 26): an outward and an inward distance field
//       from the squared Euclidean transform (glyph test over the text
//       rectangle plus one column and row past its right and bottom edges, as
//       the bevel), then fsqrt of every value, with no clamp to the range.
//       Soft lighting follows: the outer slope where 0 < O < Ro, the inner one,
//       a descending height, where 0 < I < Ri.
//     - local: one signed field, Ro outside, 1 - f on the anti-aliased edge
//       (f = byte / 254.999, not the bevel's 254.99), 1 - Ri inside; the
//       outward pass pulls outside pixels down to their distance from the
//       edge, the inward pass pulls inside pixels up toward the outside
//       distances seen through the edge, giving a continuous signed field.
//       Row 0 of the frame is deliberately left as filled. Hard lighting
//       follows, skipping pixels at exactly Ro.
//     In the emboss the first-colour plane carries the lit amount and the
//     second-colour plane the shaded one.
//  3. Style 3 (two-sided) lights a second pair of planes with the horizontal
//     light components negated. Each pair is smoothed and softened with the
//     bevel's buffer rotation (mirrored pair first).
//  4. Colouring as the bevel's; style 3 weighs the normal relief by the mask
//     coverage (read strictly inside the text rectangle's first row and
//     column, deliberately) and the mirrored relief by its complement, and
//     lays the first over the second.
//  5. The frame is blended with mode 2 in the separate-work-image mode and
//     mode 1 otherwise (the reverse of the bevel), and also into the extra
//     destination when the stack gives one.

#include "effect/filters/GxEmboss.h"

#include <cmath>
#include <cstdlib>

#include "effect/GxEffectMath.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

constexpr float kFar = 1e20f;
constexpr int kExactFromSize = 26;
constexpr int kTwoSidedStyle = 3;

// ((difference + 1) * weight) >> 8, 255 when the product reaches 65536.
inline int WeightedAlpha(int difference, int weight) {
    const int product = (difference + 1) * weight;
    return product >= 65536 ? 255 : product >> 8;
}

inline int Channel(uint32_t argb, int shift) { return int((argb >> shift) & 0xFF); }

// The two-sided pixel: the normal relief (weight m) over the mirrored one.
uint32_t TwoSidedPixel(GxReliefTone normal, GxReliefTone mirrored, int m, uint32_t firstColour,
                       uint32_t secondColour) {
    const int alpha1 = WeightedAlpha(normal.difference, m);
    const int alpha2 = WeightedAlpha(mirrored.difference, 255 - m);
    const uint32_t c1 = ReliefTint(normal.first ? firstColour : secondColour, alpha1);
    const uint32_t c2 = ReliefTint(mirrored.first ? firstColour : secondColour, alpha2);
    if (alpha1 == 0) return c2;
    if (alpha1 == 255) return c1;
    const int k = 255 - alpha1;
    int alpha = alpha1 + ((k * (alpha2 + 1)) >> 8);
    uint32_t out = uint32_t(alpha > 255 ? 255 : alpha) << 24;
    for (int shift = 16; shift >= 0; shift -= 8) {
        const int v = Channel(c1, shift) + ((k * (Channel(c2, shift) + 1)) >> 8);
        out |= uint32_t(v > 255 ? 255 : v) << shift;
    }
    return out;
}

}  // namespace

GxEmboss::GxEmboss() { style = GxECore::kEmboss; }

int32_t GxEmboss::getOffset() {
    int pixels = 0;
    if (property == nullptr || !ReliefSizePixels(property->size, &pixels)) return 0;
    const int offset =
        EffectMath::TruncToInt(std::ceil(property->size * 0.5f + 1.0f)) + ReliefSoften(property->soften);
    return offset > 0 ? offset : 0;  // a negative size asks for no margin
}

GxEmbossGeometry GxEmboss::geometry(const GxEmbossProperty& property) {
    GxEmbossGeometry g;
    if (!ReliefSizePixels(property.size, &g.size)) return g;
    g.soften = ReliefSoften(property.soften);
    g.smooth = property.technique == 0;
    const float half = float(g.size) * 0.5f;
    if (!g.smooth) {
        g.outRange = int(std::ceil(half + 3.0f));
        g.inRange = int(std::ceil(half + 1.0f));
        g.smoothRadius = 0;
        g.gain = 1.0f;
    } else {
        g.outRange = g.inRange = int(std::ceil(float(g.size) * 0.25f + 1.0f));
        g.smoothRadius = int(std::ceil(half + 1.0f));
        g.gain = kEmbossVariant.smoothGain;
    }
    const int spread = 2 * g.smoothRadius > 2 * g.soften ? 2 * g.smoothRadius : 2 * g.soften;
    g.margin = g.outRange + spread;
    g.exact = g.smooth && g.size >= kExactFromSize;
    // Sizes below zero follow the same arithmetic while it stays inside the
    // frame: negative ranges only empty the search windows. A negative margin
    // would put the text outside its own frame, and a negative smoothing
    // radius would blur outside the planes: those draw nothing.
    g.drawable = g.margin >= 0 && g.smoothRadius >= 0;
    return g;
}

int GxEmboss::partialOutDT(void* raw) {
    auto* job = static_cast<DistanceJob*>(raw);
    if (job == nullptr) return 0;
    return ReliefLocalDistance(job->field, job->width, job->height, job->outRadius, job->y0, job->y1,
                               GxReliefTargets::kPositive);
}

// Inside pixels (below 0) take the largest v - sqrt(dx^2 + dy^2) over the
// pixels above 1.0 within inRadius; rows outer, columns inner, each
// improvement stored at once.
int GxEmboss::partialInDT(void* raw) {
    auto* job = static_cast<DistanceJob*>(raw);
    if (job == nullptr || job->field == nullptr || job->width <= 0 || job->height <= 0) return 0;
    const int width = job->width;
    const int height = job->height;
    const int largest = width > height ? width : height;
    const int r = job->inRadius > largest ? largest : job->inRadius;
    const int y0 = job->y0 > 0 ? job->y0 : 0;
    const int y1 = job->y1 < height ? job->y1 : height;
    if (r < 0) return 0;
    GxReliefRoots roots(ReliefLargestRootIndex(width, height, r));
    float* field = job->field;
    const size_t stride = size_t(width);
    for (int y = y0; y < y1; ++y) {
        for (int x = 0; x < width; ++x) {
            float cur = field[size_t(y) * stride + size_t(x)];
            if (!(cur < 0.0f)) continue;
            const int yyEnd = y + r + 1 < height ? y + r + 1 : height;
            const int xxEnd = x + r + 1 < width ? x + r + 1 : width;
            for (int yy = y - r > 0 ? y - r : 0; yy < yyEnd; ++yy) {
                const float* row = field + size_t(yy) * stride;
                const int64_t dy2 = int64_t(yy - y) * (yy - y);
                for (int xx = x - r > 0 ? x - r : 0; xx < xxEnd; ++xx) {
                    const float v = row[xx];
                    if (!(v > 1.0f)) continue;
                    const float candidate = v - roots[dy2 + int64_t(xx - x) * (xx - x)];
                    if (cur < candidate) {
                        cur = candidate;
                        field[size_t(y) * stride + size_t(x)] = cur;
                    }
                }
            }
        }
    }
    return 0;
}

int GxEmboss::partialLightHardProcess(void* raw) {
    auto* job = static_cast<LightJob*>(raw);
    if (job == nullptr || job->field == nullptr) return 0;
    const GxReliefLight light{job->lightX, job->lightY, job->lightZ};
    const float outRange = float(job->outRange);
    const float inRange = float(job->inRange);
    const ptrdiff_t stride = job->stride;
    for (int y = job->y0; y < job->y1; ++y) {
        for (int x = job->x0; x < job->x1; ++x) {
            const ptrdiff_t i = ptrdiff_t(y) * stride + x;
            const float* f = job->field + i;
            if (*f == outRange) continue;
            const float incidence = ReliefSlopeIncidence(light, job->normalZ, f, stride, 0.5f);
            const int n = int(ReliefClampLevel(incidence * 255.0f));
            // Outside the edge the height falls to Ro; inside, the flat floor 1 - Ri gives 0.
            const float e = *f > 0.0f ? outRange - *f : *f + inRange - 1.0f;
            const int edge = ReliefEdgeFactor(e);
            job->secondPlane[i] = ReliefPlaneValue((256 - n) * job->secondAlpha, edge);
            job->firstPlane[i] = ReliefPlaneValue((n + 1) * job->firstAlpha, edge);
        }
    }
    return 0;
}

int GxEmboss::partialLightSoftProcess(void* raw) {
    auto* job = static_cast<LightJob*>(raw);
    if (job == nullptr || job->field == nullptr || job->innerField == nullptr) return 0;
    const GxReliefLight light{job->lightX, job->lightY, job->lightZ};
    const float outRange = float(job->outRange);
    const float inRange = float(job->inRange);
    const ptrdiff_t stride = job->stride;
    for (int y = job->y0; y < job->y1; ++y) {
        for (int x = job->x0; x < job->x1; ++x) {
            const ptrdiff_t i = ptrdiff_t(y) * stride + x;
            const float* o = job->field + i;
            if (*o > 0.0f && *o < outRange) {
                const float incidence = ReliefSlopeIncidence(light, job->normalZ, o, stride, 0.5f);
                const int n = int(ReliefClampLevel(incidence * 255.0f));
                const int edge = ReliefEdgeFactor(outRange - *o);
                job->secondPlane[i] = ReliefPlaneValue((256 - n) * job->secondAlpha, edge);
                job->firstPlane[i] = ReliefPlaneValue((n + 1) * job->firstAlpha, edge);
            }
            const float* in = job->innerField + i;
            if (*in > 0.0f && *in < inRange) {
                // The inward distance is a descending height: gradient negated,
                // level inverted, the washes' roles swapped.
                const float incidence = ReliefSlopeIncidence(light, job->normalZ, in, stride, -0.5f);
                const int n = int(ReliefClampLevel((1.0f - incidence) * 255.0f));
                const int edge = ReliefEdgeFactor(inRange - *in);
                job->secondPlane[i] = ReliefPlaneValue((n + 1) * job->secondAlpha, edge);
                job->firstPlane[i] = ReliefPlaneValue((256 - n) * job->firstAlpha, edge);
            }
        }
    }
    return 0;
}

void GxEmboss::doPostProcessing(GxECore::ParamPostProcessing* pp) {
    if (property == nullptr || pp == nullptr || pp->dst == nullptr || pp->src == nullptr ||
        pp->src->pixels == nullptr || pp->textRect == nullptr) {
        return;
    }
    const GxEmbossProperty& prop = *property;
    const GxEmbossGeometry g = geometry(prop);
    if (!g.drawable) return;

    const GxReliefLight light = ReliefLightVector(prop.angle, prop.altitude, prop.direction);
    const float normalZ = ReliefNormalZ(prop.depth, kEmbossVariant.depthFloor);

    const GxRect& text = *pp->textRect;
    GxReliefFrame frame;
    if (!ReliefPlanFrame(text, g.margin, &frame)) return;
    const int W = frame.width;
    const int H = frame.height;
    const int M = frame.margin;
    const size_t stride = size_t(W);
    const bool twoSided = prop.style == kTwoSidedStyle;

    GxReliefPlanes normal;
    GxReliefPlanes mirrored;
    if (!normal.Allocate(frame.pixels)) return;
    if (twoSided && !mirrored.Allocate(frame.pixels)) return;

    const GxBitmap& mask = *pp->src;
    LightJob job{normal.second, normal.first, nullptr, nullptr, W, g.outRange, g.inRange, normalZ,
                 light.x, light.y, light.z, int(ReliefSecondColour(prop) >> 24),
                 int(ReliefFirstColour(prop) >> 24), 1, W - 1, 1, H - 1};
    auto lightBoth = [&](int (*process)(void*)) {
        process(&job);
        if (!twoSided) return;
        LightJob flipped = job;
        flipped.secondPlane = mirrored.second;
        flipped.firstPlane = mirrored.first;
        flipped.lightX = -job.lightX;
        flipped.lightY = -job.lightY;
        process(&flipped);
    };

    if (g.exact) {
        float* outer = static_cast<float*>(std::malloc(sizeof(float) * frame.pixels));
        float* inner = static_cast<float*>(std::malloc(sizeof(float) * frame.pixels));
        bool ok = outer != nullptr && inner != nullptr;
        if (ok) {
            for (int y = 0; y < H; ++y) {
                const bool rowInWindow = y >= M && y <= H - M;
                for (int x = 0; x < W; ++x) {
                    const bool glyph = rowInWindow && x >= M && x <= W - M &&
                                       ReliefMaskAt(mask, int64_t(frame.x0) + x, int64_t(frame.y0) + y) != 0;
                    outer[size_t(y) * stride + size_t(x)] = glyph ? 0.0f : kFar;
                    inner[size_t(y) * stride + size_t(x)] = glyph ? kFar : 0.0f;
                }
            }
            ok = ReliefExactTransform(outer, W, H) && ReliefExactTransform(inner, W, H);
        }
        if (ok) {
            for (size_t i = 0; i < frame.pixels; ++i) {
                outer[i] = outer[i] >= 0.0f ? fsqrt(outer[i]) : 0.0f;
                inner[i] = inner[i] >= 0.0f ? fsqrt(inner[i]) : 0.0f;
            }
            job.field = outer;
            job.innerField = inner;
            lightBoth(&partialLightSoftProcess);
        }
        std::free(outer);
        std::free(inner);
        if (!ok) return;
    } else {
        float* field = static_cast<float*>(std::malloc(sizeof(float) * frame.pixels));
        if (field == nullptr) return;
        const float outside = float(g.outRange);
        for (size_t i = 0; i < frame.pixels; ++i) field[i] = outside;
        const float floor = float(1 - g.inRange);
        const int textWidth = text.right - text.left;
        const int textHeight = text.bottom - text.top;
        for (int j = 0; j < textHeight; ++j) {
            float* row = field + size_t(M + j) * stride + size_t(M);
            for (int i = 0; i < textWidth; ++i) {
                const unsigned m = ReliefMaskAt(mask, int64_t(text.left) + i, int64_t(text.top) + j);
                const float f = float(m) / kEmbossVariant.coverageScale;
                row[i] = f < 0.001f ? outside : (f < 1.0f ? 1.0f - f : floor);
            }
        }
        DistanceJob distance{field, H, W, g.outRange, g.inRange, 1, H};
        partialOutDT(&distance);
        partialInDT(&distance);
        job.field = field;
        lightBoth(&partialLightHardProcess);
        std::free(field);
    }

    if (twoSided && !ReliefSmoothAndSoften(&mirrored, W, H, g.smooth, g.smoothRadius, g.soften)) return;
    if (!ReliefSmoothAndSoften(&normal, W, H, g.smooth, g.smoothRadius, g.soften)) return;

    auto* argb = static_cast<uint32_t*>(std::malloc(sizeof(uint32_t) * frame.pixels));
    if (argb == nullptr) return;
    if (!twoSided) {
        ReliefColourise(normal.first, normal.second, frame.pixels, g.gain, ReliefFirstColour(prop),
                        ReliefSecondColour(prop), argb);
    } else {
        for (int y = 0; y < H; ++y) {
            const bool rowInside = y > M && y < H - M;
            for (int x = 0; x < W; ++x) {
                const size_t i = size_t(y) * stride + size_t(x);
                const int m = rowInside && x > M && x < W - M
                                  ? int(ReliefMaskAt(mask, int64_t(frame.x0) + x, int64_t(frame.y0) + y))
                                  : 0;
                argb[i] = TwoSidedPixel(ReliefTone(normal.first[i], normal.second[i], g.gain),
                                        ReliefTone(mirrored.first[i], mirrored.second[i], g.gain), m,
                                        ReliefFirstColour(prop), ReliefSecondColour(prop));
            }
        }
    }
    ReliefDrawFrame(kEmbossVariant, frame, argb, pp->separateWorkImage, pp->dst, pp->extraDst);
    std::free(argb);
}

}  // namespace Glimmer
