// The compositor's row kernels and whole effect-stack drawings on realistic
// text: a 96 px title line (one mask of about 1200 x 200) and a six-line
// paragraph (six masks of about 1000 x 60 on a 1000 x 400 surface). Each case
// reports time per call and megapixels of destination per second; the stack
// draws also the heap allocations of a drawing after the first ("allocs").

#include <benchmark/benchmark.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <vector>

#include "AllocationCounter.h"
#include "effect/GxBlender.h"
#include "effect/GxEffect.h"
#include "effect/GxGlyph.h"
#include "foundation/GxBitmap.h"

namespace Glimmer {
namespace {

// A line of pseudo-glyphs: per cell a stem and a bowl with anti-aliased
// edges, so the mask has the mix of empty, partial and full coverage that
// real text has (roughly a quarter of the pixels covered).
std::vector<unsigned char> LineMask(int width, int height, float size) {
    std::vector<unsigned char> mask(size_t(width) * height, 0);
    const float stroke = size * 0.11f, advance = size * 0.62f, baseline = height * 0.78f;
    auto cover = [](float distance) {
        const float c = std::clamp(0.5f - distance, 0.0f, 1.0f);
        return static_cast<unsigned char>(c * 255.0f + 0.5f);
    };
    int glyph = 0;
    for (float left = size * 0.1f; left + advance < width; left += advance, ++glyph) {
        const float cx = left + advance * 0.45f, cy = baseline - size * 0.25f, r = size * 0.22f;
        const float stemX = (glyph % 3 == 0) ? left + size * 0.08f : left + advance * 0.75f;
        const float stemTop = baseline - size * ((glyph % 2) ? 0.72f : 0.5f);
        for (int y = std::max(0, int(stemTop) - 2); y < std::min(height, int(baseline) + 2); ++y) {
            for (int x = std::max(0, int(left)); x < std::min(width, int(left + advance)); ++x) {
                const float px = x + 0.5f, py = y + 0.5f;
                const float ring = std::fabs(std::hypot(px - cx, py - cy) - r) - stroke * 0.5f;
                // Signed distance to the stem's box.
                const float dx = std::fabs(px - stemX) - stroke * 0.5f;
                const float dy = std::max(stemTop - py, py - baseline);
                const float stem = std::hypot(std::max(dx, 0.0f), std::max(dy, 0.0f)) +
                                   std::min(std::max(dx, dy), 0.0f);
                unsigned char& m = mask[size_t(y) * width + x];
                m = std::max({m, cover(ring), cover(stem)});
            }
        }
    }
    return mask;
}

struct Scene {
    int width, height;                  // surface
    int lineWidth, lineHeight, lines;   // one mask per line
    float size;
};

constexpr Scene kTitle{1200, 200, 1180, 150, 1, 96.0f};
constexpr Scene kParagraph{1000, 400, 980, 60, 6, 40.0f};

void SetMegapixels(benchmark::State& state, double pixels) {
    state.counters["Mpx/s"] = benchmark::Counter(pixels / 1e6, benchmark::Counter::kIsIterationInvariantRate);
}

// --- compositor operations over one title-line mask

void BM_Blend8(benchmark::State& state) {
    const int mode = int(state.range(0));
    const Scene& s = kTitle;
    std::vector<unsigned char> mask = LineMask(s.width, s.height, s.size);
    GxBitmap dst(s.width, s.height, 4);
    // Half the destination already drawn, so the destination-over rules take
    // every branch.
    for (size_t i = 0; i < size_t(s.width) * s.height; ++i)
        if ((i / 7) % 2) std::memset(dst.pixels + i * 4, int(i % 256), 4);
    for (auto _ : state) {
        GxBlender::drawBitmapBlend8(0, 0, &dst, mask.data(), s.width, s.height, s.width, 0xC0336699,
                                    mode);
        benchmark::DoNotOptimize(dst.pixels);
    }
    SetMegapixels(state, double(s.width) * s.height);
}
BENCHMARK(BM_Blend8)->ArgName("mode")->Arg(1)->Arg(2)->Arg(3)->Arg(7);

void BM_Blend32(benchmark::State& state) {
    const int mode = int(state.range(0));
    const Scene& s = kTitle;
    std::vector<unsigned char> mask = LineMask(s.width, s.height, s.size);
    std::vector<unsigned> image(mask.size());
    for (size_t i = 0; i < mask.size(); ++i) image[i] = mask[i] * 0x01010101u;
    GxBitmap dst(s.width, s.height, 4);
    for (auto _ : state) {
        std::memset(dst.pixels, 0, size_t(s.width) * s.height * 2);  // top half clear each time
        GxBlender::drawBitmapBlend32(0, 0, &dst, image.data(), s.width, s.height, s.width, mode);
        benchmark::DoNotOptimize(dst.pixels);
    }
    SetMegapixels(state, double(s.width) * s.height);
}
BENCHMARK(BM_Blend32)->ArgName("mode")->Arg(1)->Arg(2);

void BM_MaskUnion(benchmark::State& state) {
    const Scene& s = kTitle;
    std::vector<unsigned char> mask = LineMask(s.width, s.height, s.size);
    GxBitmap dst(s.width, s.height, 1);
    for (auto _ : state) {
        GxBlender::drawBitmap(0, 0, &dst, mask.data(), s.width, s.height, 0xFF000000);
        benchmark::DoNotOptimize(dst.pixels);
    }
    SetMegapixels(state, double(s.width) * s.height);
}
BENCHMARK(BM_MaskUnion);

void BM_ConvertToJava(benchmark::State& state) {
    GxBitmap dst(kTitle.width, kTitle.height, 4);
    for (auto _ : state) {
        GxBlender::convertBGRAToARGB(&dst);
        benchmark::DoNotOptimize(dst.pixels);
    }
    SetMegapixels(state, double(kTitle.width) * kTitle.height);
}
BENCHMARK(BM_ConvertToJava);

// --- whole drawings through the stack

enum Stack { kTextOnly, kTranslucentText, kShadowStrokeText, kShadowsGlows };

void Build(GxEffect& effect, Stack stack) {
    effect.addText(0xFF202020);
    if (stack == kTranslucentText) effect.setTextOpacity(0.8f);
    if (stack == kShadowStrokeText) {
        effect.addOuterShadowText(135.0f, 6.0f, 8.0f, 0xFF000000, 0.6f);
        effect.addStrokeText(4.0f, 0xFFFFFFFF, 1.0f, 0, 1);
    }
    if (stack == kShadowsGlows) {
        effect.addOuterShadowText(135.0f, 6.0f, 8.0f, 0xFF000000, 0.6f);
        effect.addInnerShadowText(90.0f, 3.0f, 4.0f, 0xFF000000, 0.6f);
        effect.addOuterGlowText(12.0f, 0xFFFFD700, 0.8f, 0, nullptr);
        effect.addInnerGlowText(6.0f, 0xFF20A0FF, 0.8f, 0, nullptr);
    }
}

void BM_StackDraw(benchmark::State& state) {
    const Scene& s = state.range(0) == 0 ? kTitle : kParagraph;
    const Stack stack = Stack(state.range(1));
    std::vector<unsigned char> line = LineMask(s.lineWidth, s.lineHeight, s.size);
    GxGlyph glyph;
    glyph.buffer = line.data();
    glyph.width = uint16_t(s.lineWidth);
    glyph.height = uint16_t(s.lineHeight);

    GxEffect effect(nullptr);
    Build(effect, stack);
    const int left = effect.getLeftOffset(), top = effect.getTopOffset();
    const int w = s.width + left + effect.getRightOffset();
    const int h = s.height + top + effect.getBottomOffset();
    GxBitmap dst(w, h, 4);
    const size_t bytes = size_t(w) * h * 4;
    auto draw = [&] {
        std::memset(dst.pixels, 0, bytes);
        effect.initEffect(w, h);
        effect.setDstBitmap(&dst);
        for (int i = 0; i < s.lines; ++i)
            effect.renderEffectLayer(left + 10, top + 10 + i * (s.height - 20) / s.lines, &glyph);
        effect.doEffectPostProcessing();
        effect.compositeLayers(&dst);
    };
    draw();  // the stack keeps its work memory from here on
    const long allocations = Bench::AllocationsOf(draw);
    for (auto _ : state) {
        draw();
        benchmark::DoNotOptimize(dst.pixels);
    }
    SetMegapixels(state, double(w) * h);
    state.counters["allocs"] = double(allocations);
}
BENCHMARK(BM_StackDraw)
    ->ArgNames({"paragraph", "stack"})
    ->ArgsProduct({{0, 1}, {kTextOnly, kTranslucentText, kShadowStrokeText, kShadowsGlows}})
    ->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace Glimmer
