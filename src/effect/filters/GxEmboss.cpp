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
#include <cstring>

#include "effect/GxEffectMath.h"
#include "effect/filters/GxReliefRows.h"
#include "effect/filters/GxSqrt.h"

namespace Glimmer {
namespace {

constexpr float kFar = 1e20f;
constexpr int kExactFromSize = 26;
constexpr int kTwoSidedStyle = 3;

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
                               GxReliefTargets::kPositive, job->scratch);
}

// Inside pixels (below 0) take the largest v - sqrt(dx^2 + dy^2) over the
// pixels above 1.0 within inRadius (GxReliefSearch.cpp).
int GxEmboss::partialInDT(void* raw) {
    auto* job = static_cast<DistanceJob*>(raw);
    if (job == nullptr) return 0;
    ReliefInwardDistance(job->field, job->width, job->height, job->inRadius, job->y0, job->y1, job->scratch);
    return 0;
}

namespace {

ReliefRows::Light RowLight(const GxEmboss::LightJob& job) {
    ReliefRows::Light light;
    light.x = job.lightX;
    light.y = job.lightY;
    light.z = job.lightZ;
    light.normalZ = job.normalZ;
    light.range = float(job.outRange);
    light.inRange = float(job.inRange);
    light.secondAlpha = job.secondAlpha;
    light.firstAlpha = job.firstAlpha;
    return light;
}

}  // namespace

int GxEmboss::partialLightHardProcess(void* raw) {
    auto* job = static_cast<LightJob*>(raw);
    if (job == nullptr || job->field == nullptr || job->x0 >= job->x1) return 0;
    const ReliefRows::Light light = RowLight(*job);
    const ReliefRows::EmbossHardLightRow row = ReliefRows::Active().embossHardLight;
    const ptrdiff_t stride = job->stride;
    for (int y = job->y0; y < job->y1; ++y) {
        const ptrdiff_t i = ptrdiff_t(y) * stride + job->x0;
        row(job->field + i, stride, job->x1 - job->x0, light, job->secondPlane + i, job->firstPlane + i);
    }
    return 0;
}

int GxEmboss::partialLightSoftProcess(void* raw) {
    auto* job = static_cast<LightJob*>(raw);
    if (job == nullptr || job->field == nullptr || job->innerField == nullptr || job->x0 >= job->x1) return 0;
    const ReliefRows::Light light = RowLight(*job);
    const ReliefRows::EmbossSoftLightRow row = ReliefRows::Active().embossSoftLight;
    const ptrdiff_t stride = job->stride;
    for (int y = job->y0; y < job->y1; ++y) {
        const ptrdiff_t i = ptrdiff_t(y) * stride + job->x0;
        row(job->field + i, job->innerField + i, stride, job->x1 - job->x0, light, job->secondPlane + i,
            job->firstPlane + i);
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
    const size_t N = frame.pixels;
    const bool twoSided = prop.style == kTwoSidedStyle;

    // The field or fields, later the frame's words; the plane pairs and the
    // blurs' spare, which the pairs share as they take turns.
    GxScratch* scratch = pp->scratch;
    GxReliefBuffer fieldMemory(scratch, GxScratch::kPlaneA);
    GxReliefBuffer planeMemory(scratch, GxScratch::kPlaneB);
    GxReliefBuffer rowMemory(scratch, GxScratch::kRows);
    const bool blurs = g.smooth || g.soften >= 1;
    const size_t pairs = twoSided ? 2 : 1;
    float* fields = fieldMemory.get<float>(g.exact ? 2 * N : N);
    unsigned char* planeBytes = planeMemory.get<unsigned char>(N * (2 * pairs + (blurs ? 1 : 0)));
    if (fields == nullptr || planeBytes == nullptr) return;
    // The lighting leaves the frame's outer ring and unlit pixels as they are: zero.
    std::memset(planeBytes, 0, 2 * pairs * N);
    unsigned char* spare = blurs ? planeBytes + 2 * pairs * N : nullptr;
    GxReliefPlanes normal;
    GxReliefPlanes mirrored;
    normal.Use(planeBytes, planeBytes + N, spare);
    if (twoSided) mirrored.Use(planeBytes + 2 * N, planeBytes + 3 * N, spare);

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
        float* outer = fields;
        float* inner = fields + N;
        // Glyph pixels: rows and columns M .. size - M, both ends included.
        const int last = W - M < W - 1 ? W - M : W - 1;
        unsigned char* bytes = rowMemory.get<unsigned char>(stride);
        if (bytes == nullptr) return;
        for (int y = 0; y < H; ++y) {
            float* o = outer + size_t(y) * stride;
            float* in = inner + size_t(y) * stride;
            for (int x = 0; x < W; ++x) {
                o[x] = kFar;
                in[x] = 0.0f;
            }
            if (y < M || y > H - M || last < M) continue;
            ReliefMaskRow(mask, int64_t(frame.x0) + M, int64_t(frame.y0) + y, last - M + 1, bytes);
            for (int x = M; x <= last; ++x) {
                if (bytes[x - M] == 0) continue;
                o[x] = 0.0f;
                in[x] = kFar;
            }
        }
        // The soft lighting reads a distance where it lies strictly between 0
        // and its range, and at the four neighbours of such a pixel. fsqrt is
        // within 0.2 % of the root, so a squared distance past (range + 2)^2
        // never passes for one below the range, and those neighbours lie
        // within range + 2: the transforms are needed exactly only that far.
        if (!ReliefExactTransformNear(outer, W, H, g.outRange + 2, scratch) ||
            !ReliefExactTransformNear(inner, W, H, g.inRange + 2, scratch)) {
            return;
        }
        for (size_t i = 0; i < N; ++i) {
            outer[i] = outer[i] >= 0.0f ? fsqrt(outer[i]) : 0.0f;
            inner[i] = inner[i] >= 0.0f ? fsqrt(inner[i]) : 0.0f;
        }
        job.field = outer;
        job.innerField = inner;
        lightBoth(&partialLightSoftProcess);
    } else {
        float* field = fields;
        const float outside = float(g.outRange);
        const float floor = float(1 - g.inRange);
        // The starting value of every coverage byte, as the per-pixel rule gives it.
        float start[256];
        for (int m = 0; m < 256; ++m) {
            const float f = float(m) / kEmbossVariant.coverageScale;
            start[m] = f < 0.001f ? outside : (f < 1.0f ? 1.0f - f : floor);
        }
        for (size_t i = 0; i < N; ++i) field[i] = outside;
        const int textWidth = text.right - text.left;
        const int textHeight = text.bottom - text.top;
        unsigned char* bytes = rowMemory.get<unsigned char>(size_t(textWidth > 0 ? textWidth : 1));
        if (bytes == nullptr) return;
        for (int j = 0; j < textHeight; ++j) {
            float* row = field + size_t(M + j) * stride + size_t(M);
            ReliefMaskRow(mask, text.left, int64_t(text.top) + j, textWidth, bytes);
            for (int i = 0; i < textWidth; ++i) row[i] = start[bytes[i]];
        }
        DistanceJob distance{field, H, W, g.outRange, g.inRange, 1, H, scratch};
        partialOutDT(&distance);
        partialInDT(&distance);
        job.field = field;
        lightBoth(&partialLightHardProcess);
    }

    if (twoSided) {
        if (!ReliefSmoothAndSoften(&mirrored, W, H, g.smooth, g.smoothRadius, g.soften, scratch)) return;
        normal.spare = mirrored.spare;  // the buffer the mirrored pair left free
    }
    if (!ReliefSmoothAndSoften(&normal, W, H, g.smooth, g.smoothRadius, g.soften, scratch)) return;

    uint32_t* argb = fieldMemory.get<uint32_t>(N);  // the fields' memory, no longer needed
    if (argb == nullptr) return;
    if (!twoSided) {
        ReliefColourise(normal.first, normal.second, N, g.gain, ReliefFirstColour(prop), ReliefSecondColour(prop),
                        argb);
    } else {
        // The coverage weighs the normal relief strictly inside the text
        // rectangle's first row and column: columns M + 1 .. W - M - 1.
        unsigned char* coverage = rowMemory.get<unsigned char>(stride);
        if (coverage == nullptr) return;
        const int width = W - 2 * M - 1;
        const ReliefRows::TwoSidedRow twoSidedRow = ReliefRows::Active().twoSided;
        for (int y = 0; y < H; ++y) {
            std::memset(coverage, 0, stride);
            if (y > M && y < H - M && width > 0)
                ReliefMaskRow(mask, int64_t(frame.x0) + M + 1, int64_t(frame.y0) + y, width, coverage + M + 1);
            const size_t i = size_t(y) * stride;
            twoSidedRow(normal.first + i, normal.second + i, mirrored.first + i, mirrored.second + i, coverage, W,
                        g.gain, ReliefFirstColour(prop), ReliefSecondColour(prop), argb + i);
        }
    }
    ReliefDrawFrame(kEmbossVariant, frame, argb, pp->separateWorkImage, pp->dst, pp->extraDst);
}

}  // namespace Glimmer
