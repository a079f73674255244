// Scaling a glyph image into a mask.
//
// Emoji fonts hold their glyphs as images at one or a few sizes (strikes).
// Such an image gets the text's size, stretch and slant here, and its
// coverage (the colour's alpha) joins the mask like an outline's coverage.
//
// Every mask pixel is mapped back into the image: the pixel centre (X, Y)
// lies at image row v = (Y - originY) / scale + top, and, once the slant of
// its row is taken off, at column u = (X - originX - skewX * (Y - originY)) /
// (scale * scaleX) - left. Around that point the image is filtered with a
// tent, separably: first down the columns, then along the row. The tent
// reaches one image pixel to each side when the image grows (linear
// interpolation) and one mask pixel's worth of image when it shrinks (an
// average over the whole footprint, so that small emoji do not sparkle).
// Weights are normalised by their sum over the whole tent, image pixels
// outside the image counting as transparent, so the edges fade as an
// outline's anti-aliased edges do.
//
// Only the rows and columns the filtered image can reach are visited. The
// arithmetic is plain float in a fixed order, so the result is the same on
// every CPU; the coverage is rounded to the nearest byte and blended over
// the mask as outline coverage is.

#include "platform/linux/ScaledBitmap.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace Glimmer::Platform {
namespace {

// A tent wider than this many image pixels would mean an image shrunk to a
// speck; it is not drawn.
constexpr float kMaxRadius = 256.0f;

struct Plan {
    float scaleX;    // mask pixels per image column, with the stretch (may be negative)
    float radiusX;   // tent half-widths in image pixels
    float radiusY;
    int firstRow;    // mask rows the image can reach, inclusive
    int lastRow;
};

bool MakePlan(const StrikeGlyph& glyph, const BitmapPlacement& p, Plan* plan) {
    if (glyph.width <= 0 || glyph.height <= 0) return false;
    if (!(p.scale > 0.0f) || !std::isfinite(p.scale) || !std::isfinite(p.scaleX) || !std::isfinite(p.skewX) ||
        !std::isfinite(p.originX) || !std::isfinite(p.originY)) {
        return false;
    }
    plan->scaleX = p.scale * p.scaleX;
    if (!(std::fabs(plan->scaleX) > 0.0f)) return false;
    plan->radiusX = std::max(1.0f, 1.0f / std::fabs(plan->scaleX));
    plan->radiusY = std::max(1.0f, 1.0f / p.scale);
    if (plan->radiusX > kMaxRadius || plan->radiusY > kMaxRadius) return false;
    // Row centres strictly inside the tent's reach of the first and last image rows.
    const float top = p.originY + p.scale * (0.5f - plan->radiusY - float(glyph.top));
    const float bottom = p.originY + p.scale * (float(glyph.height) - 0.5f + plan->radiusY - float(glyph.top));
    constexpr float kFar = 1.0e6f;   // far beyond any mask
    if (!(top > -kFar && bottom < kFar && std::fabs(p.originX) < kFar)) return false;
    plan->firstRow = int(std::floor(top - 0.5f));
    plan->lastRow = int(std::ceil(bottom - 0.5f));
    return true;
}

// Where mask row `y` starts the image, once slanted.
float RowShift(const BitmapPlacement& p, int y) { return p.originX + p.skewX * (float(y) + 0.5f - p.originY); }

// The mask columns row `y` can reach, inclusive.
void RowColumns(const StrikeGlyph& glyph, const BitmapPlacement& p, const Plan& plan, int y, int* first,
                int* last) {
    const float shift = RowShift(p, y);
    const float a = shift + plan.scaleX * (float(glyph.left) + 0.5f - plan.radiusX);
    const float b = shift + plan.scaleX * (float(glyph.left + glyph.width) - 0.5f + plan.radiusX);
    *first = int(std::floor(std::min(a, b) - 0.5f));
    *last = int(std::ceil(std::max(a, b) - 0.5f));
}

// Calls use(i, weight) for every image pixel i the tent of half-width
// `radius` around `centre` weighs; returns the sum of the weights.
template <typename Use>
float Tent(float centre, float radius, Use&& use) {
    const int first = int(std::ceil(centre - 0.5f - radius));
    const int last = int(std::floor(centre - 0.5f + radius));
    float total = 0.0f;
    for (int i = first; i <= last; ++i) {
        const float weight = 1.0f - std::fabs(float(i) + 0.5f - centre) / radius;
        if (!(weight > 0.0f)) continue;
        total += weight;
        use(i, weight);
    }
    return total;
}

}  // namespace

LayoutRect ScaledBitmapBounds(const StrikeGlyph& glyph, const BitmapPlacement& placement) {
    LayoutRect bounds;
    Plan plan;
    if (!MakePlan(glyph, placement, &plan)) return bounds;
    // The slant moves a row's reach linearly with y: the extremes lie on the
    // first and last rows.
    int firstA, lastA, firstB, lastB;
    RowColumns(glyph, placement, plan, plan.firstRow, &firstA, &lastA);
    RowColumns(glyph, placement, plan, plan.lastRow, &firstB, &lastB);
    bounds.left = float(std::min(firstA, firstB));
    bounds.right = float(std::max(lastA, lastB) + 1);
    bounds.top = float(plan.firstRow);
    bounds.bottom = float(plan.lastRow + 1);
    return bounds;
}

void DrawScaledBitmap(const StrikeGlyph& glyph, const BitmapPlacement& p, bool antiAlias, uint8_t* mask, int width,
                      int height) {
    Plan plan;
    if (glyph.coverage == nullptr || mask == nullptr || width <= 0 || height <= 0 || !MakePlan(glyph, p, &plan)) {
        return;
    }
    const int firstRow = std::max(plan.firstRow, 0);
    const int lastRow = std::min(plan.lastRow, height - 1);
    const size_t imageWidth = size_t(glyph.width);
    std::vector<float> column(imageWidth);   // the image filtered down its columns, for one mask row
    for (int y = firstRow; y <= lastRow; ++y) {
        std::fill(column.begin(), column.end(), 0.0f);
        const float v = (float(y) + 0.5f - p.originY) / p.scale + float(glyph.top);
        const float rowTotal = Tent(v, plan.radiusY, [&](int i, float weight) {
            if (i < 0 || i >= glyph.height) return;
            const uint8_t* row = glyph.coverage + size_t(i) * imageWidth;
            for (size_t u = 0; u < imageWidth; ++u) column[u] += weight * float(row[u]);
        });
        if (!(rowTotal > 0.0f)) continue;

        int first, last;
        RowColumns(glyph, p, plan, y, &first, &last);
        first = std::max(first, 0);
        last = std::min(last, width - 1);
        const float shift = RowShift(p, y);
        uint8_t* out = mask + size_t(y) * size_t(width);
        for (int x = first; x <= last; ++x) {
            const float u = (float(x) + 0.5f - shift) / plan.scaleX - float(glyph.left);
            float sum = 0.0f;
            const float total = Tent(u, plan.radiusX, [&](int i, float weight) {
                if (i >= 0 && i < glyph.width) sum += weight * column[size_t(i)];
            });
            if (!(total > 0.0f)) continue;
            const float value = sum / (rowTotal * total);
            uint32_t s = value >= 254.5f ? 255u : value > 0.0f ? uint32_t(value + 0.5f) : 0u;
            if (!antiAlias) {
                if (s < 128) continue;
                s = 255;
            }
            if (s == 0) continue;
            out[x] = CoverageOver(s, out[x]);
        }
    }
}

}  // namespace Glimmer::Platform
