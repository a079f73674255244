// Glyph coverage on Linux.
//
// Each glyph's outline is scaled and shaped as its run says (FontLinux),
// moved to its place in the mask in 26.6 fixed point, and handed to
// FreeType's anti-aliasing rasteriser with a span callback instead of a
// target bitmap. The rasteriser computes exact area coverage per pixel
// (0..255) for the glyph alone; the callback blends each span over the mask
// with source-over, d = s + d - s * d / 255 (rounded), so overlapping glyphs
// (joined scripts, tight kerning) add up instead of overwriting each other.
// Nothing is hinted: outlines keep their exact scaled shape at every size,
// which makes the masks the same on every CPU.
//
// Without anti-aliasing a pixel is fully on when the glyph covers at least
// half of it, else untouched. Without sub-pixel positioning each glyph's
// origin is rounded to the nearest whole pixel first.
//
// Colour glyphs give coverage too: each colour layer is rasterised like an
// outline with its coverage scaled by its colour's alpha (layers blend over
// each other as glyphs do), and a glyph image from a colour strike is scaled,
// stretched and slanted into the mask by ScaledBitmap. Fake bold leaves
// images as they are.

#include <algorithm>
#include <cmath>

#include "platform/TextLayout.h"
#include "platform/linux/FontLinux.h"
#include "platform/linux/ScaledBitmap.h"

namespace Glimmer::Platform {
namespace {

// Texts larger than this are not drawn: the outline arithmetic stays well
// inside 32 bits and no mask could hold such glyphs anyway.
constexpr float kMaxDrawableSize = 16384.0f;

struct SpanTarget {
    uint8_t* mask;
    int width;
    int height;
    bool antiAlias;
    uint32_t alpha;   // of the layer's colour; 255 for plain outlines
};

void BlendSpans(int y, int count, const FT_Span* spans, void* user) {
    auto* target = static_cast<SpanTarget*>(user);
    // The rasteriser's row y covers [y, y + 1) with y up; mask rows go down.
    int row = -y - 1;
    if (row < 0 || row >= target->height) return;
    uint8_t* line = target->mask + size_t(row) * size_t(target->width);
    for (int i = 0; i < count; ++i) {
        int x0 = spans[i].x;
        int x1 = x0 + int(spans[i].len);
        if (x0 < 0) x0 = 0;
        if (x1 > target->width) x1 = target->width;
        uint32_t s = spans[i].coverage;
        if (!target->antiAlias) {
            if (s < 128) continue;
            s = 255;
        }
        if (target->alpha != 255) s = Div255(s * target->alpha);
        if (s == 0) continue;
        for (int x = x0; x < x1; ++x) line[x] = CoverageOver(s, line[x]);
    }
}

bool Drawable(const RunFont& run) {
    return run.font != nullptr && std::isfinite(run.size) && run.size > 0.0f &&
           run.size <= kMaxDrawableSize && std::isfinite(run.scaleX) && std::isfinite(run.skewX) &&
           std::fabs(run.scaleX) <= 64.0f && std::fabs(run.skewX) <= 64.0f;
}

// A position in pixels as 26.6, or false when it is too far out to matter:
// no glyph of a drawable size reaches a mask (at most 65535 pixels a side)
// from a million pixels away, and nearer positions keep the rasteriser's
// arithmetic inside 32 bits.
bool To26Dot6(float pixels, FT_Pos* out) {
    constexpr float kFar = 1.0e6f;
    if (!(pixels > -kFar && pixels < kFar)) return false;
    *out = FT_Pos(std::lroundf(pixels * 64.0f));
    return true;
}

// A strike image drawn for `run` with its glyph origin at (x, y).
BitmapPlacement Placement(const RunFont& run, const StrikeGlyph& glyph, float x, float y) {
    BitmapPlacement placement;
    placement.originX = x;
    placement.originY = y;
    placement.scale = run.size / glyph.ppem;
    placement.scaleX = run.scaleX;
    placement.skewX = run.skewX;
    return placement;
}

}  // namespace

void DrawGlyphs(const RunFont& run, const uint16_t* glyphIds, const float* positions, size_t count,
                float originX, float originY, uint8_t* mask, int width, int height) {
    if (!Drawable(run) || glyphIds == nullptr || positions == nullptr || mask == nullptr ||
        width <= 0 || height <= 0) {
        return;
    }
    auto* font = const_cast<FontLinux*>(static_cast<const FontLinux*>(run.font));
    SpanTarget target{mask, width, height, run.antiAlias, 255};
    for (size_t i = 0; i < count; ++i) {
        float x = originX + positions[2 * i];
        float y = originY + positions[2 * i + 1];
        if (!run.subpixel) {
            x = std::floor(x + 0.5f);
            y = std::floor(y + 0.5f);
        }
        FT_Pos dx, dy;
        if (!To26Dot6(x, &dx) || !To26Dot6(y, &dy)) continue;
        if (font->HasColorStrikes()) {
            font->WithStrikeGlyph(run.size, glyphIds[i], false, [&](const StrikeGlyph& glyph) {
                DrawScaledBitmap(glyph, Placement(run, glyph, x, y), run.antiAlias, mask, width, height);
            });
            continue;
        }
        font->WithLayers(run, glyphIds[i], [&](FT_Outline* outline, FT_Library library, uint8_t alpha) {
            target.alpha = alpha;
            FT_Outline_Translate(outline, dx, -dy);
            FT_Raster_Params params = {};
            params.source = outline;
            params.flags = FT_RASTER_FLAG_AA | FT_RASTER_FLAG_DIRECT | FT_RASTER_FLAG_CLIP;
            params.gray_spans = BlendSpans;
            params.user = &target;
            params.clip_box.xMin = 0;
            params.clip_box.yMin = -FT_Pos(height);
            params.clip_box.xMax = FT_Pos(width);
            params.clip_box.yMax = 0;
            FT_Outline_Render(library, outline, &params);
        });
    }
}

LayoutRect GlyphBounds(const RunFont& run, uint32_t glyphId) {
    LayoutRect bounds;
    if (!Drawable(run)) return bounds;
    auto* font = const_cast<FontLinux*>(static_cast<const FontLinux*>(run.font));
    if (font->HasColorStrikes()) {
        font->WithStrikeGlyph(run.size, glyphId, true, [&](const StrikeGlyph& glyph) {
            bounds = ScaledBitmapBounds(glyph, Placement(run, glyph, 0.0f, 0.0f));
        });
        return bounds;
    }
    font->WithLayers(run, glyphId, [&](FT_Outline* outline, FT_Library, uint8_t) {
        if (outline->n_points == 0) return;
        FT_BBox box;
        FT_Outline_Get_CBox(outline, &box);
        // Whole pixels around the control box, y turned downwards.
        LayoutRect layer;
        layer.left = float(box.xMin >> 6);
        layer.right = float((box.xMax + 63) >> 6);
        layer.top = -float((box.yMax + 63) >> 6);
        layer.bottom = -float(box.yMin >> 6);
        if (bounds.IsEmpty()) {
            bounds = layer;
            return;
        }
        bounds.left = std::min(bounds.left, layer.left);
        bounds.top = std::min(bounds.top, layer.top);
        bounds.right = std::max(bounds.right, layer.right);
        bounds.bottom = std::max(bounds.bottom, layer.bottom);
    });
    return bounds;
}

}  // namespace Glimmer::Platform
