// Whole renders of real text: a 96 px title line (about 1200 x 200 pixels)
// and a six-line paragraph (about 1000 x 400), each with a stroke and a drop
// shadow, through GxTextObject::RenderTextEffect: shaping, glyph masks, the
// effect stack and the final picture. The text-only cases show how much of
// that is glyph drawing. Each case reports time per render and megapixels of
// output per second.

#include <benchmark/benchmark.h>

#include <memory>
#include <string>

#include "effect/GxEffect.h"
#include "font/SystemFontFamilies.h"
#include "foundation/List.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace Glimmer {
namespace {

constexpr const char* kFont = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

struct Scene {
    const wchar_t* text;
    float size;
    int viewWidth, viewHeight;
    int lines, lineLength, lineHeight, firstBaseline;
    float stroke, shadow;   // 0: no such effect
};

const wchar_t kTitle[] = L"Glimmering Headline";
const wchar_t kParagraph[] =
    L"The quick brown fox jumps over the lazy dog twice.\n"
    L"Pack my box with five dozen liquor jugs, she said.\n"
    L"How vexingly quick daft zebras jump over the hill!\n"
    L"Sphinx of black quartz, judge my vow without fear.\n"
    L"The five boxing wizards jump quickly along a road.\n"
    L"Jackdaws love my big sphinx of quartz, I was told.";

std::unique_ptr<GxTextObject> MakeText(const Scene& scene) {
    InstallSystemFontFamilies();
    auto text = std::make_unique<GxTextObject>();
    text->Construct();
    text->SetFont(kFont);
    text->SetText(scene.text);
    Platform::Paint paint;
    paint.size = scene.size;
    text->SetPaint(paint);
    text->SetTextColor(0xFFFFFFFFu);
    GxEffect* effect = text->GetEffect();
    if (scene.stroke > 0.0f) effect->addStrokeText(scene.stroke, 0xFF2040C0u, 1.0f, 0, 1);
    if (scene.shadow > 0.0f) effect->addOuterShadowText(135.0f, scene.shadow, scene.shadow, 0xFF000000u, 0.8f);

    List lines;
    lines.Construct();
    for (int i = 0; i < scene.lines; ++i) {
        auto* line = new GxLineInfo();
        line->start = i * (scene.lineLength + 1);
        line->end = line->start + scene.lineLength;
        line->x = 10;
        line->baseline = scene.firstBaseline + i * scene.lineHeight;
        line->bounds = GxRect(10, line->baseline - scene.lineHeight * 3 / 4, scene.viewWidth - 10,
                              line->baseline + scene.lineHeight / 4);
        lines.Add(line);
    }
    text->SetLineInfo(&lines);
    return text;
}

void Render(benchmark::State& state, const Scene& scene) {
    std::unique_ptr<GxTextObject> text = MakeText(scene);
    GxEffect* effect = text->GetEffect();
    const int width = scene.viewWidth + effect->getLeftOffset() + effect->getRightOffset();
    const int height = scene.viewHeight + effect->getTopOffset() + effect->getBottomOffset();
    text->GetView()->SetSize(scene.viewWidth, scene.viewHeight);
    text->GetView()->SetBitmapWidth(width);
    text->GetView()->SetBitmapHeight(height);
    for (auto _ : state) benchmark::DoNotOptimize(text->RenderTextEffect(width, height));
    state.counters["MP/s"] = benchmark::Counter(double(width) * height * 1e-6,
                                                benchmark::Counter::kIsIterationInvariantRate);
    state.SetLabel(std::to_string(width) + "x" + std::to_string(height));
}

const int kTitleLength = int(std::wstring(kTitle).size());
const Scene kTitleScene{kTitle, 96.0f, 1180, 180, 1, kTitleLength, 120, 130, 6.0f, 8.0f};
const Scene kParagraphScene{kParagraph, 32.0f, 980, 380, 6, 50, 60, 50, 3.0f, 4.0f};

void BM_TitleStrokeShadow(benchmark::State& state) { Render(state, kTitleScene); }
void BM_ParagraphStrokeShadow(benchmark::State& state) { Render(state, kParagraphScene); }

void BM_TitleTextOnly(benchmark::State& state) {
    Scene scene = kTitleScene;
    scene.stroke = scene.shadow = 0.0f;
    Render(state, scene);
}

void BM_ParagraphTextOnly(benchmark::State& state) {
    Scene scene = kParagraphScene;
    scene.stroke = scene.shadow = 0.0f;
    Render(state, scene);
}

BENCHMARK(BM_TitleStrokeShadow)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ParagraphStrokeShadow)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_TitleTextOnly)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ParagraphTextOnly)->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace Glimmer
