// Effect filters on realistic text masks: a 96 px title line (about
// 1200 x 200) and a six-line paragraph (about 1000 x 400). Each case reports
// the time of one post-processing call and megapixels of canvas per second.

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <memory>
#include <random>

#include "effect/GxECoreBase.h"
#include "effect/GxProperty.h"
#include "effect/filters/GxInnerShadow.h"
#include "effect/filters/GxOuterShadow.h"
#include "effect/filters/GxStroke.h"
#include "effect/filters/GxBevel.h"
#include "effect/filters/GxEmboss.h"
#include "effect/filters/GxInnerGlow.h"
#include "effect/filters/GxLinearGradient.h"
#include "effect/filters/GxOuterGlow.h"
#include "effect/filters/GxPattern.h"
#include "effect/filters/GxRadialGradient.h"
#include "foundation/GxBitmap.h"
#include "foundation/GxRect.h"

namespace Glimmer {
namespace {

// ------------------------------------------------------------ text masks

// Anti-aliased coverage of a distance to a shape edge (negative inside).
uint8_t Coverage(float signedDistance) {
    float c = 0.5f - signedDistance;
    c = c < 0.0f ? 0.0f : (c > 1.0f ? 1.0f : c);
    return static_cast<uint8_t>(c * 255.0f + 0.5f);
}

void Union(GxBitmap& mask, int x, int y, uint8_t v) {
    if (x < 0 || y < 0 || x >= int(mask.width) || y >= int(mask.height)) return;
    uint8_t& p = mask.pixels[size_t(y) * mask.width + size_t(x)];
    p = std::max(p, v);
}

// A bar from (x0, y0) to (x1, y1) of the given thickness.
void Bar(GxBitmap& mask, float x0, float y0, float x1, float y1, float thick) {
    const float dx = x1 - x0, dy = y1 - y0, len2 = dx * dx + dy * dy;
    const int left = int(std::min(x0, x1) - thick) - 1, right = int(std::max(x0, x1) + thick) + 2;
    const int top = int(std::min(y0, y1) - thick) - 1, bottom = int(std::max(y0, y1) + thick) + 2;
    for (int y = top; y < bottom; ++y) {
        for (int x = left; x < right; ++x) {
            const float px = x + 0.5f - x0, py = y + 0.5f - y0;
            float t = len2 > 0 ? (px * dx + py * dy) / len2 : 0.0f;
            t = t < 0 ? 0 : (t > 1 ? 1 : t);
            const float ex = px - t * dx, ey = py - t * dy;
            Union(mask, x, y, Coverage(std::sqrt(ex * ex + ey * ey) - thick * 0.5f));
        }
    }
}

void Ring(GxBitmap& mask, float cx, float cy, float r, float thick) {
    for (int y = int(cy - r - thick) - 1; y < int(cy + r + thick) + 2; ++y) {
        for (int x = int(cx - r - thick) - 1; x < int(cx + r + thick) + 2; ++x) {
            const float d = std::hypot(x + 0.5f - cx, y + 0.5f - cy);
            Union(mask, x, y, Coverage(std::fabs(d - r) - thick * 0.5f));
        }
    }
}

// Lines of glyph-like shapes (stems, bowls, bars, diagonals) of the given
// pixel size, inset by `margin` so effects have room around them. The text
// box is returned through `box`.
GxBitmap TextLikeMask(int width, int height, int lines, int margin, float size, GxRect* box) {
    GxBitmap mask(unsigned(width), unsigned(height), 1);
    std::mt19937 rng(42);
    const float lineHeight = float(height - 2 * margin) / float(lines);
    const float xHeight = size * 0.5f, cap = size * 0.72f, thick = size * 0.11f, advance = size * 0.58f;
    int right = margin, bottom = margin;
    for (int line = 0; line < lines; ++line) {
        const float base = margin + lineHeight * (float(line) + 0.78f);
        for (float x = float(margin); x + advance < float(width - margin); x += advance) {
            if (rng() % 7 == 0) continue;  // a space
            const float top = base - ((rng() % 3 == 0) ? cap : xHeight);
            switch (rng() % 4) {
                case 0:  // n-like: stem, arch, stem
                    Bar(mask, x + thick, top, x + thick, base, thick);
                    Ring(mask, x + advance * 0.45f, top + xHeight * 0.35f, advance * 0.3f, thick);
                    Bar(mask, x + advance * 0.75f, top + xHeight * 0.35f, x + advance * 0.75f, base, thick);
                    break;
                case 1:  // o-like
                    Ring(mask, x + advance * 0.45f, base - xHeight * 0.5f, xHeight * 0.45f, thick);
                    break;
                case 2:  // t-like
                    Bar(mask, x + advance * 0.4f, top, x + advance * 0.4f, base, thick);
                    Bar(mask, x + advance * 0.1f, base - xHeight, x + advance * 0.7f, base - xHeight, thick);
                    break;
                default:  // v-like
                    Bar(mask, x + advance * 0.1f, top, x + advance * 0.4f, base, thick);
                    Bar(mask, x + advance * 0.7f, top, x + advance * 0.4f, base, thick);
                    break;
            }
            right = std::max(right, int(x + advance));
        }
        bottom = int(base + thick) + 1;
    }
    *box = GxRect(margin / 2, margin / 2, std::min(width, right + margin / 2), std::min(height, bottom + margin / 2));
    return mask;
}

struct Scene {
    GxBitmap mask;
    GxBitmap dst;
    GxRect box;
};

// 0: a 96 px title line, 1: a six-line paragraph of 40 px text.
Scene MakeScene(int which) {
    Scene s;
    if (which == 0) {
        s.mask = TextLikeMask(1200, 200, 1, 48, 96.0f, &s.box);
        s.dst = GxBitmap(1200, 200, 4);
    } else {
        s.mask = TextLikeMask(1000, 400, 6, 24, 40.0f, &s.box);
        s.dst = GxBitmap(1000, 400, 4);
    }
    return s;
}

void RunFilter(benchmark::State& state, GxECoreBase& layer) {
    Scene scene = MakeScene(int(state.range(0)));
    GxECore::ParamPostProcessing pp{&scene.dst, &scene.mask, &scene.box, 0, nullptr};
    for (auto _ : state) {
        layer.doPostProcessing(&pp);
        benchmark::ClobberMemory();
    }
    const double pixels = double(scene.mask.width) * scene.mask.height;
    state.counters["Mpx/s"] = benchmark::Counter(pixels * 1e-6, benchmark::Counter::kIsIterationInvariantRate);
    state.SetLabel(state.range(0) == 0 ? "title 1200x200" : "paragraph 1000x400");
}

// --------------------------------------------------- stroke and shadows

void BM_Stroke(benchmark::State& state, int position, float size) {
    GxStroke stroke;
    GxStrokeProperty record(size, 0xFF203040u, 1.0f, 0, position);
    stroke.setProperty(&record);
    RunFilter(state, stroke);
}

void BM_OuterShadow(benchmark::State& state, float size) {
    GxOuterShadow shadow;
    GxOuterShadowProperty record(135.0f, 6.0f, size, 0xC0000000u, 0.75f);
    shadow.setProperty(&record);
    RunFilter(state, shadow);
}

void BM_InnerShadow(benchmark::State& state, float size) {
    GxInnerShadow shadow;
    GxInnerShadowProperty record(135.0f, 4.0f, size, 0xC0000000u, 0.75f);
    shadow.setProperty(&record);
    RunFilter(state, shadow);
}

BENCHMARK_CAPTURE(BM_Stroke, outside_4, 1, 4.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Stroke, centre_4, 0, 4.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Stroke, inside_4, 2, 4.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Stroke, outside_16, 1, 16.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Stroke, outside_64, 1, 64.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_OuterShadow, size_8, 8.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_OuterShadow, size_30, 30.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_InnerShadow, size_8, 8.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_InnerShadow, size_30, 30.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// ------------------------------------------------- glows, gradients, pattern

const GxGradient kGlowRamp[3] = {{0xFFFFE080u, 0.0f, 0.0f}, {0xFFFF8000u, 0.0f, 0.5f}, {0xFF800000u, 0.0f, 1.0f}};

void BM_OuterGlow(benchmark::State& state, float size) {
    GxOuterGlow glow;
    GxOuterGlowProperty record(size, 0xFFFFC000u, 1.0f, 3, const_cast<GxGradient*>(kGlowRamp));
    glow.setProperty(&record);
    RunFilter(state, glow);
}

void BM_InnerGlow(benchmark::State& state, float size) {
    GxInnerGlow glow;
    GxInnerGlowProperty record(size, 0xFFFFC000u, 1.0f, 3, const_cast<GxGradient*>(kGlowRamp));
    glow.setProperty(&record);
    RunFilter(state, glow);
}

void BM_LinearGradient(benchmark::State& state) {
    GxLinearGradient fill;
    GxLinearGradientProperty record(30.0f, 1.0f, 1.0f, 3, const_cast<GxGradient*>(kGlowRamp));
    fill.setProperty(&record);
    RunFilter(state, fill);
}

void BM_RadialGradient(benchmark::State& state) {
    GxRadialGradient fill;
    GxRadialGradientProperty record(0.0f, 1.0f, 1.0f, 3, const_cast<GxGradient*>(kGlowRamp));
    fill.setProperty(&record);
    RunFilter(state, fill);
}

void BM_Pattern(benchmark::State& state, float scale) {
    GxBitmap tile(37, 23, 4);
    for (size_t i = 0; i < size_t(37) * 23 * 4; ++i) tile.pixels[i] = uint8_t(i * 97 % 251);
    GxPattern fill;
    GxPatternProperty record(&tile, scale, 0.9f);
    fill.setProperty(&record);
    RunFilter(state, fill);
}

BENCHMARK_CAPTURE(BM_OuterGlow, size_10, 10.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_OuterGlow, size_40, 40.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_OuterGlow, size_100, 100.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_InnerGlow, size_10, 10.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_InnerGlow, size_40, 40.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_LinearGradient)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_RadialGradient)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Pattern, scale_1, 1.0f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Pattern, scale_2_5, 2.5f)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

// ----------------------------------------------------- bevel and emboss

// style, technique (0 smooth, 1 hard), size, soften; light from 120 deg at 30 deg.
void BM_Bevel(benchmark::State& state, int style, int technique, float size, int soften) {
    GxBevel bevel;
    GxBevelProperty record(style, 3.0f, size, 1, technique, soften, 1.0f, 120.0f, 30.0f, 0xFFFFFFFFu,
                           0.75f, 0xFF000000u, 0.75f);
    bevel.setProperty(&record);
    RunFilter(state, bevel);
}

void BM_Emboss(benchmark::State& state, int style, int technique, float size, int soften) {
    GxEmboss emboss;
    GxEmbossProperty record(style, 3.0f, size, 1, technique, soften, 1.0f, 120.0f, 30.0f, 0xFFFFFFFFu,
                            0.75f, 0xFF000000u, 0.75f);
    emboss.setProperty(&record);
    RunFilter(state, emboss);
}

BENCHMARK_CAPTURE(BM_Bevel, inner_smooth_5, 1, 0, 5.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Bevel, inner_smooth_15_exact, 1, 0, 15.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Bevel, inner_hard_5_soften_4, 1, 1, 5.0f, 4)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Bevel, outer_smooth_10, 0, 0, 10.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Bevel, outer_hard_20, 0, 1, 20.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Emboss, hard_10, 0, 1, 10.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Emboss, smooth_10_soften_4, 0, 0, 10.0f, 4)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Emboss, smooth_30_exact, 0, 0, 30.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_Emboss, two_sided_smooth_10, 3, 0, 10.0f, 0)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace Glimmer
