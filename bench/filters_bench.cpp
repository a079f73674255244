// Effect filters on realistic text masks: a 96 px title line (about
// 1200 x 200) and a six-line paragraph (about 1000 x 400). Each case reports
// the time of one post-processing call and megapixels of canvas per second.
//
//   filters_bench [benchmark options]
//   filters_bench --relief-hash   a hash of the bevel's and the emboss's output
//                                 over a broad set of parameters, one case a
//                                 line: to check that a change of the relief
//                                 code leaves every byte as it was

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <memory>
#include <random>
#include <vector>

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

// ------------------------------------------------- relief output hashes

uint64_t Fnv1a(uint64_t hash, const GxBitmap& image) {
    const size_t bytes = size_t(image.width) * image.height * image.bytesPerPixel;
    for (size_t k = 0; k < bytes; ++k) hash = (hash ^ image.pixels[k]) * 1099511628211ull;
    return hash;
}

struct ReliefCase {
    bool emboss;
    int scene;  // 0 title, 1 paragraph, 2 a small mask with the text against its edges
    int style, technique, soften, direction, separate;
    float size, depth, angle, altitude;
    uint32_t highlight, shadow;
};

// One render onto a destination of fixed random bytes (so the blend modes
// show), the emboss also into an extra destination when it has a work image.
uint64_t ReliefHash(const ReliefCase& c, const Scene& scene) {
    GxBitmap dst(scene.dst.width, scene.dst.height, 4);
    std::mt19937 rng(3);
    for (size_t k = 0; k < size_t(dst.width) * dst.height * 4; ++k) dst.pixels[k] = uint8_t(rng() >> 24);
    GxBitmap extra(dst);
    GxBitmap mask(scene.mask);
    GxRect box = scene.box;
    GxECore::ParamPostProcessing pp{&dst, &mask, &box, c.separate, c.separate ? &extra : nullptr};
    std::unique_ptr<GxECoreBase> layer;
    if (c.emboss) {
        auto emboss = std::make_unique<GxEmboss>();
        GxEmbossProperty record(c.style, c.depth, c.size, c.direction, c.technique, c.soften, 1.0f, c.angle,
                                c.altitude, c.highlight, 1.0f, c.shadow, 1.0f);
        emboss->setProperty(&record);
        layer = std::move(emboss);
    } else {
        auto bevel = std::make_unique<GxBevel>();
        GxBevelProperty record(c.style, c.depth, c.size, c.direction, c.technique, c.soften, 1.0f, c.angle,
                               c.altitude, c.highlight, 1.0f, c.shadow, 1.0f);
        bevel->setProperty(&record);
        layer = std::move(bevel);
    }
    layer->doPostProcessing(&pp);
    uint64_t hash = Fnv1a(1469598103934665603ull, dst);
    return c.separate ? Fnv1a(hash, extra) : hash;
}

int ReliefHashes() {
    Scene scenes[3] = {MakeScene(0), MakeScene(1), {}};
    scenes[2].mask = TextLikeMask(150, 60, 1, 0, 40.0f, &scenes[2].box);
    scenes[2].dst = GxBitmap(150, 60, 4);

    std::vector<ReliefCase> cases;
    const ReliefCase base{false, 0, 1, 0, 0, 1, 0, 5.0f, 3.0f, 120.0f, 30.0f, 0xBFFFFFFFu, 0xBF000000u};
    // Every size 0..30 with each technique (2 acts as hard), the bevel's inner
    // and outer styles and the emboss's plain and two-sided ones, on all scenes.
    for (int emboss = 0; emboss < 2; ++emboss)
        for (int scene = 0; scene < 3; ++scene)
            for (int style : {0, 1, 3})
                for (int technique = 0; technique < 3; ++technique)
                    for (int size = 0; size <= 30; ++size) {
                        if (style == (emboss ? 1 : 3)) continue;
                        if (technique == 2 && size % 5 != 0) continue;
                        ReliefCase c = base;
                        c.emboss = emboss;
                        c.scene = scene;
                        c.style = style;
                        c.technique = technique;
                        c.size = float(size);
                        cases.push_back(c);
                    }
    // Soften over sizes and techniques.
    for (int emboss = 0; emboss < 2; ++emboss)
        for (int soften : {1, 2, 3, 5, 8, 16})
            for (int technique = 0; technique < 2; ++technique)
                for (float size : {2.0f, 7.0f, 12.0f, 17.0f, 28.0f}) {
                    ReliefCase c = base;
                    c.emboss = emboss;
                    c.style = emboss ? 3 : (soften % 2);
                    c.technique = technique;
                    c.soften = soften;
                    c.size = size;
                    c.scene = soften % 3 == 0 ? 1 : 0;
                    cases.push_back(c);
                }
    // The light and everything else at random, with a fixed seed.
    std::mt19937 rng(20240611);
    const float depths[] = {0.0f, 0.05f, 0.15f, 0.5f, 1.0f, 3.0f, 10.0f, 100.0f};
    const float angles[] = {0.0f, 30.0f, 45.0f, 90.0f, 120.0f, 135.0f, 180.0f, 225.0f, 270.0f, 300.0f, 359.5f, -40.0f, 77.7f};
    const float altitudes[] = {0.0f, 5.0f, 15.0f, 30.0f, 45.0f, 60.0f, 89.0f, 90.0f};
    const float sizes[] = {-1.0f, 0.4f, 1.0f, 2.5f, 4.6f, 6.0f, 9.0f, 10.0f, 13.9f, 14.0f, 15.0f, 19.0f, 24.0f,
                           25.5f, 26.0f, 29.0f, 33.0f, 40.0f, 60.0f};
    for (int k = 0; k < 700; ++k) {
        ReliefCase c;
        c.emboss = rng() % 2;
        c.scene = int(rng() % 3);
        c.style = int(rng() % 4);
        c.technique = int(rng() % 3);
        c.soften = rng() % 3 == 0 ? int(rng() % 17) : 0;
        c.direction = int(rng() % 2);
        c.separate = int(rng() % 2);
        c.size = sizes[rng() % std::size(sizes)];
        c.depth = depths[rng() % std::size(depths)];
        c.angle = angles[rng() % std::size(angles)];
        c.altitude = altitudes[rng() % std::size(altitudes)];
        c.highlight = rng() | (rng() % 4 == 0 ? 0xFF000000u : 0u);
        c.shadow = rng() | (rng() % 4 == 0 ? 0xFF000000u : 0u);
        cases.push_back(c);
    }

    uint64_t all = 1469598103934665603ull;
    for (const ReliefCase& c : cases) {
        const uint64_t hash = ReliefHash(c, scenes[c.scene]);
        std::printf("%s scene %d style %d technique %d size %g soften %d depth %g direction %d angle %g "
                    "altitude %g colours %08x %08x separate %d: %016llx\n",
                    c.emboss ? "emboss" : "bevel", c.scene, c.style, c.technique, double(c.size), c.soften,
                    double(c.depth), c.direction, double(c.angle), double(c.altitude), c.highlight, c.shadow,
                    c.separate, (unsigned long long)hash);
        all = (all ^ hash) * 1099511628211ull;
    }
    std::printf("%zu cases, all: %016llx\n", cases.size(), (unsigned long long)all);
    return 0;
}

}  // namespace
}  // namespace Glimmer

int main(int argc, char** argv) {
    if (argc == 2 && std::strcmp(argv[1], "--relief-hash") == 0) return Glimmer::ReliefHashes();
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
