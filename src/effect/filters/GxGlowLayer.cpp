#include "effect/filters/GxGlowLayer.h"

#include <algorithm>
#include <cstring>

#include "effect/GxBlendRows.h"
#include "effect/GxBlender.h"
#include "effect/GxEffectMath.h"
#include "effect/filters/GxColorRamp.h"
#include "effect/filters/GxBlurRows.h"
#include "effect/filters/GxGaussian.h"
#include "effect/filters/GxLayerSupport.h"

namespace Glimmer {

using EffectMath::TruncToInt;

namespace {

// Sizes and pass counts of one glow drawing, worked out before any pixel.
struct GlowPlan {
    int32_t g = 0;           // trunc(size) + 1: the frame is 2g wide on every side
    int32_t width = 0;       // W = box width + 4g
    int32_t height = 0;      // H = box height + 4g
    int32_t iterations = 0;  // box filter passes
    int32_t radius = 0;      // Gaussian radius Rg
    size_t pixels = 0;       // W * H
};

bool PlanGlow(float size, const GxRect& box, GlowPlan* plan) {
    const int64_t g = int64_t(TruncToInt(size)) + 1;
    if (g <= 0) return false;
    const int64_t w = int64_t(box.right - box.left) + 4 * g;
    const int64_t h = int64_t(box.bottom - box.top) + 4 * g;
    if (w > INT32_MAX || h > INT32_MAX) return false;
    size_t bytes = 0;
    if (!GxBitmap::PixelBytes(uint32_t(w), uint32_t(h), 4, &bytes)) return false;
    plan->g = int32_t(g);
    plan->width = int32_t(w);
    plan->height = int32_t(h);
    plan->pixels = size_t(w) * size_t(h);
    const int32_t passes = TruncToInt(float(plan->g) * 0.475f);
    plan->iterations = passes > 1 ? passes : 1;
    const int32_t radius = TruncToInt(float(plan->g) * 0.9f);
    plan->radius = radius < 0 ? 1 : radius;
    return true;
}

// The glyph box into the middle of the plane, 2g in from every side, on a
// frame of 0 (outer) or inverted on a frame of 255 (inner).
void FillPlane(unsigned char* plane, const GlowPlan& plan, const GxBitmap& mask, const GxRect& box,
               bool inverted) {
    std::memset(plane, inverted ? 0xFF : 0x00, plan.pixels);
    const int32_t inset = 2 * plan.g;
    const size_t boxWidth = size_t(box.right - box.left);
    for (int32_t r = 0; r < box.bottom - box.top; ++r) {
        const unsigned char* from = mask.pixels + size_t(box.top + r) * mask.width + size_t(box.left);
        unsigned char* to = plane + size_t(inset + r) * size_t(plan.width) + size_t(inset);
        if (inverted) {
            for (size_t x = 0; x < boxWidth; ++x) to[x] = uint8_t(255 - from[x]);
        } else {
            std::memcpy(to, from, boxWidth);
        }
    }
}

// The glow image, one row at a time, drawn destination-over into `dst` with
// its top-left corner at (left, top) as it is made (each pixel of `dst` takes
// one image pixel, so the row order changes nothing). Rows [Rg, H - Rg) are
// blurred vertically into a byte row and then horizontally into colour;
// `shade[v]` is the premultiplied colour of result v. `row`, `next` and
// `values` are W bytes of scratch, `colours` W words (the outer glow colours each pixel as
// it draws it, in one pass, and needs no colour row).
//
// With a `frame` the image is W x H and the frame fills the rows and columns
// the passes cannot reach. Without one (a frame of transparent pixels, which
// destination-over leaves alone) only the part the passes reach is drawn.
void BlurColourAndDraw(const unsigned char* plane, const GlowPlan& plan, const GxGaussian& g, bool inverted,
                       const uint32_t* shade, const uint32_t* frame, const GxBitmap* dst, int left, int top,
                       unsigned char* row, unsigned char* next, unsigned char* values, uint32_t* colours) {
    const int32_t W = plan.width, R = plan.radius;
    const size_t stride = size_t(W);
    const int n = W - 2 * R;
    const BlurRows::BlurRow blur = BlurRows::Active().blurRow;
    const BlurRows::BlurRows2 blurTwo = BlurRows::Active().blurRows2;
    const BlurRows::ShadeRow colour = BlurRows::Active().shadeRow;
    auto draw = [&](int y, const uint32_t* from, int x, int count) {
        GxBlender::drawBitmapBlend32(left + x, top + y, dst, from, count, 1, count, GxE_BLEND_DST_OVER);
    };
    if (frame != nullptr) {
        for (int32_t x = 0; x < W; ++x) colours[x] = *frame;
        for (int32_t y = 0; y < R && y < plan.height; ++y) draw(y, colours, 0, W);
    }
    // Columns outside [R, W - R) of the byte row are never computed and read
    // as 0 (no coverage): they lie in the frame, 2g from the glyphs. For the
    // inner glow this matters at one place: the box filter's 0 in the plane's
    // first and last column is not blurred back in as "inside".
    std::memset(row, 0, stride);
    std::memset(next, 0, stride);
    const BlendRows::RowsTable32 over = BlendRows::Active().dstOverTable32;
    const bool drawable = dst->pixels != nullptr && dst->bytesPerPixel == 4;
    // Rows that land off `dst` are not worked out.
    const int64_t firstVisible = -int64_t(top), endVisible = int64_t(dst->height) - top;
    // Along the row blurred down the columns into `from`, coloured, drawn.
    auto finish = [&](int32_t y, const unsigned char* from) {
        blur(from + R, 1, n, g, inverted, values + R);
        // Results never exceed 255, so entry 256 (past the edge colour) is
        // only reached by the rule min(v, 256) on paper.
        if (frame != nullptr) {
            colour(values + R, n, shade, colours + R);
            draw(y, colours, 0, W);  // the frame columns still hold the frame
        } else if (drawable) {
            // Coloured as drawn: columns [R, W - R) at left + R, clipped to dst.
            const int64_t from = std::max<int64_t>(int64_t(left) + R, 0);
            const int64_t to = std::min<int64_t>(int64_t(left) + R + n, int64_t(dst->width));
            if (from < to)
                over(dst->pixels + (size_t(top + y) * dst->width + size_t(from)) * 4,
                     values + (from - (int64_t(left) + R)) + R, int(to - from), shade);
        }
    };
    // Down the columns two rows at a time where both are wanted.
    auto visible = [&](int32_t y) { return y >= firstVisible && y < endVisible; };
    for (int32_t y = R; y < plan.height - R;) {
        if (!visible(y)) {
            ++y;
        } else if (y + 1 < plan.height - R && visible(y + 1)) {
            blurTwo(plane + size_t(y) * stride + R, ptrdiff_t(stride), n, g, inverted, row + R, next + R);
            finish(y, row);
            finish(y + 1, next);
            y += 2;
        } else {
            blur(plane + size_t(y) * stride + R, ptrdiff_t(stride), n, g, inverted, row + R);
            finish(y, row);
            ++y;
        }
    }
    if (frame == nullptr) return;
    for (int32_t x = R; x < W - R; ++x) colours[x] = *frame;
    const int32_t firstUnprocessed = plan.height - R > R ? plan.height - R : R;
    for (int32_t y = firstUnprocessed; y < plan.height; ++y) draw(y, colours, 0, W);
}

}  // namespace

bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height) {
    return GlowBoxFilter(plane, iterations, width, height, nullptr);
}

bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height, GxScratch* scratch) {
    return GlowBoxFilter(plane, iterations, width, height, scratch, GxRect(0, 0, width, height));
}

bool GlowBoxFilter(unsigned char* plane, int iterations, int width, int height, GxScratch* scratch,
                   const GxRect& content) {
    if (plane == nullptr || iterations <= 0 || width <= 0 || height < 3) return true;
    const size_t w = size_t(width);
    // Three rows for new values on their way back into the plane.
    WorkBuffer<unsigned char> own;
    unsigned char* rows = nullptr;
    if (scratch != nullptr) {
        rows = scratch->get<unsigned char>(GxScratch::kRows, 3 * w);
    } else {
        own = AllocateWork<unsigned char>(3 * w);
        rows = own.get();
    }
    if (rows == nullptr) return false;
    const BlurRows::SpreadRow spread = BlurRows::Active().spreadRow;
    const BlurRows::SpreadRows2 spreadTwo = BlurRows::Active().spreadRows2;
    // A frame of 255 stays 255 beside the 0 at a row's end (6 x 255 / 4 is
    // past 255), but not between two such ends: planes that narrow are
    // rewritten in full.
    const GxRect all(0, 0, width, height);
    const GxRect& changing = width >= 4 ? content : all;
    for (int pass = 1; pass <= iterations; ++pass) {
        // What pass p can change: the content grown by p, inside the rows
        // and columns a pass rewrites.
        const int top = std::max(1, changing.top - pass), bottom = std::min(height - 1, changing.bottom + pass);
        const int left = std::max(1, changing.left - pass), right = std::min(width - 1, changing.right + pass);
        if (top < bottom && left < right) {
            const size_t span = size_t(right - left);
            // Two rows at a time. The first goes back at once (the next
            // pair reads from the second on); the second waits in one of
            // two buffers until the pair below has read it as it was.
            unsigned char* first = rows;
            unsigned char* waiting = nullptr;
            int waitingRow = 0;
            auto settle = [&] {
                if (waiting != nullptr) std::memcpy(plane + size_t(waitingRow) * w + left, waiting + left, span);
            };
            for (int y = top; y < bottom;) {
                unsigned char* row = plane + size_t(y) * w;
                const unsigned char* above = row - w + left - 1;
                if (y + 1 < bottom) {
                    unsigned char* second = rows + (waiting == rows + w ? 2 : 1) * w;
                    spreadTwo(above, row + left - 1, row + w + left - 1, row + 2 * w + left - 1, int(span) + 2,
                              first + left - 1, second + left - 1);
                    settle();
                    std::memcpy(row + left, first + left, span);
                    waiting = second;
                    waitingRow = y + 1;
                    y += 2;
                } else {
                    spread(above, row + left - 1, row + w + left - 1, int(span) + 2, first + left - 1);
                    settle();
                    std::memcpy(row + left, first + left, span);
                    waiting = nullptr;
                    ++y;
                }
            }
            settle();
        }
        // Every pass writes 0 at both ends of the rows it rewrites; the
        // first pass reads the ends as they were.
        if (pass == 1) {
            for (int y = 1; y < height - 1; ++y) {
                plane[size_t(y) * w] = 0;
                plane[size_t(y) * w + w - 1] = 0;
            }
        }
    }
    return true;
}

void MakeGlowColorTable(uint32_t* table, const GxOuterGlowProperty* property, float fadeStart,
                        int curve) {
    if (property == nullptr || property->size == 0.0f) {
        std::memset(table, 0, kColorTableSize * sizeof(uint32_t));
        return;
    }
    // Null stops count as no stops, whatever the count says.
    const int32_t count = property->stops != nullptr && property->count > 0 ? property->count : 0;
    if (count >= 2) {
        BuildColorRamp(table, property->stops, count, 0.0f, curve);
    } else {
        const uint32_t single = count == 1 ? property->stops[0].color : property->color;
        for (int i = 0; i < kColorTableSize; ++i) table[i] = single;
    }

    // Fade: alpha falls linearly from entry k to 0 at entry 256.
    if (fadeStart >= 1.0f) fadeStart = 0.99f;
    if (!(fadeStart > 0.0f)) fadeStart = 0.01f;  // NaN too
    const int k = int(double(fadeStart) * 256.0);
    for (int j = k; j < kColorTableSize; ++j) {
        const uint32_t factor = uint32_t(TruncToInt(float(256 - j) * 256.0f / float(256 - k)));
        const uint32_t alpha = ((table[j] >> 24) * factor) >> 8;
        table[j] = (table[j] & 0x00FFFFFFu) | (alpha << 24);
    }
    table[kColorTableSize - 1] = 0;
}

GxGlowLayer::~GxGlowLayer() { delete property; }

GxProperty* GxGlowLayer::getProperty() { return property; }

int32_t GxGlowLayer::getOffset() {
    if (property == nullptr) return 0;
    return TruncToInt(property->size + 0.5f);
}

void GxGlowLayer::makeColorLUT(unsigned int* table, float fadeStart, int curve) {
    if (table != nullptr) MakeGlowColorTable(table, property, fadeStart, curve);
}

void GxGlowLayer::increaseByBoxFilter(unsigned char* plane, int iterations, int width, int height) {
    GlowBoxFilter(plane, iterations, width, height);
}

void GxGlowLayer::computeGaussianWeights(int* weights, int* sum, int radius) {
    ComputeGaussianWeights(weights, sum, radius, kGlowGaussianCentre, GaussianRounding::kDouble);
}

void GxGlowLayer::replaceProperty(GxOuterGlowProperty* copy) {
    if (copy != nullptr && !copy->copyStops()) {
        delete copy;
        copy = nullptr;
    }
    delete property;
    property = copy;
}

void GxGlowLayer::drawGlow(GxECore::ParamPostProcessing* p, Side side) {
    if (p == nullptr || property == nullptr || p->textRect == nullptr || p->dst == nullptr ||
        p->src == nullptr)
        return;
    GxRect box;
    if (!ClipBoxToMask(*p->textRect, *p->src, &box)) return;
    GlowPlan plan;
    if (!PlanGlow(property->size, box, &plan)) return;
    const bool inverted = side == Side::kInner;

    GxGaussian gaussian;
    if (!PlanGaussian(&gaussian, plan.radius, kGlowGaussianCentre, GaussianRounding::kDouble)) return;
    // Work memory: the stack's when it lends it, else our own for this call.
    GxScratch* scratch = p->scratch;
    WorkBuffer<uint32_t> ownColours;
    WorkBuffer<unsigned char> ownPlane, ownRows;
    uint32_t* colours = nullptr;
    unsigned char* plane = nullptr;
    if (scratch != nullptr) {
        colours = scratch->get<uint32_t>(GxScratch::kPlaneA, size_t(plan.width));
        plane = scratch->get<unsigned char>(GxScratch::kPlaneB, plan.pixels);
    } else {
        ownColours = AllocateWork<uint32_t>(size_t(plan.width));
        ownPlane = AllocateWork<unsigned char>(plan.pixels);
        colours = ownColours.get();
        plane = ownPlane.get();
    }
    if (colours == nullptr || plane == nullptr) return;

    uint32_t table[kColorTableSize];
    makeColorLUT(table, 0.3f, kRampLinear);
    // shade[v] = premultiplied table[256 - v]; a result past 255 takes entry 0.
    uint32_t shade[kColorTableSize];
    for (int v = 0; v < kColorTableSize; ++v) shade[v] = PremultiplyColor(table[256 - v]);

    FillPlane(plane, plan, *p->src, box, inverted);
    // Outside the glyph box the plane holds only its frame value, which a
    // pass leaves as it is (but for the rows' end bytes).
    const int32_t inset = 2 * plan.g;
    const GxRect content(inset, inset, inset + (box.right - box.left), inset + (box.bottom - box.top));
    if (!GlowBoxFilter(plane, plan.iterations, plan.width, plan.height, scratch, content)) return;

    // The box filter is done with the row buffers.
    unsigned char* rows = nullptr;
    if (scratch != nullptr) {
        rows = scratch->get<unsigned char>(GxScratch::kRows, 3 * size_t(plan.width));
    } else {
        ownRows = AllocateWork<unsigned char>(3 * size_t(plan.width));
        rows = ownRows.get();
    }
    if (rows == nullptr) return;
    // The inner glow's frame is opaque white; the outer glow's is
    // transparent, so only the part the passes reach is drawn.
    const uint32_t white = 0xFFFFFFFFu;
    BlurColourAndDraw(plane, plan, gaussian, inverted, shade, inverted ? &white : nullptr, p->dst,
                      box.left - 2 * plan.g, box.top - 2 * plan.g, rows, rows + plan.width, rows + 2 * size_t(plan.width),
                      colours);
}

}  // namespace Glimmer
