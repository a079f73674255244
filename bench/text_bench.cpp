// Whole renders of real text through the public API: a 96 px title line
// (about 1200 x 200 pixels) and a six-line paragraph (about 1000 x 400), each
// with a stroke and a drop shadow: layout, shaping, glyph masks, the effect
// stack and the final picture. The text-only cases show how much of that is
// text rather than effects. Each case reports time per render and megapixels
// of output per second.
//
// The long paragraphs (10,000 words wrapped at 1000 px, the first four lines
// shown) time what long text costs before any pixel: breaking it into lines
// measures every word, so each character's font is chosen many times. One is
// plain Latin; in the other every tenth word is in another script or an emoji,
// so the system's fallback fonts are asked for all the time.

#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

#include "glimmer/glimmer.h"

namespace {

constexpr const char* kFont = "/usr/share/fonts/truetype/dejavu/DejaVuSans.ttf";

const char kTitle[] = "Glimmering Headline";
const char kParagraph[] =
    "The quick brown fox jumps over the lazy dog twice.\n"
    "Pack my box with five dozen liquor jugs, she said.\n"
    "How vexingly quick daft zebras jump over the hill!\n"
    "Sphinx of black quartz, judge my vow without fear.\n"
    "The five boxing wizards jump quickly along a road.\n"
    "Jackdaws love my big sphinx of quartz, I was told.";

struct Scene {
    const char* text;
    float size;
    int viewWidth, viewHeight;
    float stroke, shadow;   // 0: no such effect
};

const Scene kTitleScene{kTitle, 96.0f, 1180, 180, 6.0f, 8.0f};
const Scene kParagraphScene{kParagraph, 32.0f, 980, 380, 3.0f, 4.0f};

void Render(benchmark::State& state, const Scene& scene, bool exact = false) {
    const glimmer::Result<glimmer::Font> font = glimmer::Font::fromFile(kFont);
    if (!font) {
        state.SkipWithError(font.status().message().c_str());
        return;
    }
    glimmer::Text text{.content = scene.text,
                       .font = *font,
                       .style = {.size = scene.size, .color = 0xFFFFFFFFu},
                       .layout = {.width = scene.viewWidth, .height = scene.viewHeight, .padding = {10, 0, 10, 0}}};
    if (scene.stroke > 0.0f) text.effects.push_back(glimmer::Stroke{.size = scene.stroke, .color = 0xFF2040C0u});
    if (scene.shadow > 0.0f) {
        text.effects.push_back(
            glimmer::OuterShadow{.angle = 135.0f, .distance = scene.shadow, .size = scene.shadow, .opacity = 0.8f});
    }
    const glimmer::RenderOptions options{.exact = exact};
    int width = 0, height = 0;
    for (auto _ : state) {
        glimmer::Result<glimmer::Picture> picture = glimmer::render(text, options);
        if (!picture) {
            state.SkipWithError(picture.status().message().c_str());
            return;
        }
        width = picture->image.width;
        height = picture->image.height;
        benchmark::DoNotOptimize(picture->image.pixels.data());
    }
    state.counters["MP/s"] = benchmark::Counter(double(width) * height * 1e-6,
                                                benchmark::Counter::kIsIterationInvariantRate);
    state.SetLabel(std::to_string(width) + "x" + std::to_string(height));
}

// 10,000 words, every tenth from `others` when it is given.
std::string LongParagraph(bool others) {
    static const char* const kLatin[] = {"the", "quick", "brown", "fox", "jumps", "over", "lazy", "dog",
                                         "sphinx", "of", "black", "quartz", "judge", "my", "vow"};
    static const char* const kOthers[] = {"\u6F22\u5B57", "\u0645\u0631\u062D\u0628\u0627",
                                          "\u072B\u0720\u0721\u0710", "\uA9B2\uA98F\uA9C0\uA9B1",
                                          "\u0928\u092E\u0938\u094D\u0924\u0947", "\U0001F389",
                                          "\U0001F44D\U0001F3FD", "\u0E2A\u0E27\u0E31\u0E2A\u0E14\u0E35"};
    std::string text;
    unsigned seed = 1;
    for (int word = 0; word < 10000; ++word) {
        seed = seed * 1103515245u + 12345u;
        if (word > 0) text += ' ';
        if (others && word % 10 == 9) {
            text += kOthers[(seed >> 16) % (sizeof kOthers / sizeof *kOthers)];
        } else {
            text += kLatin[(seed >> 16) % (sizeof kLatin / sizeof *kLatin)];
        }
    }
    return text;
}

void LongRender(benchmark::State& state, bool others) {
    const glimmer::Result<glimmer::Font> font = glimmer::Font::fromFile(kFont);
    if (!font) {
        state.SkipWithError(font.status().message().c_str());
        return;
    }
    const glimmer::Text text{.content = LongParagraph(others),
                             .font = *font,
                             .style = {.size = 16.0f, .color = 0xFF000000u},
                             .layout = {.width = 1000, .maxLines = 4}};
    for (auto _ : state) {
        glimmer::Result<glimmer::Picture> picture = glimmer::render(text);
        if (!picture) {
            state.SkipWithError(picture.status().message().c_str());
            return;
        }
        benchmark::DoNotOptimize(picture->image.pixels.data());
    }
}

void BM_LongParagraphLatin(benchmark::State& state) { LongRender(state, false); }
void BM_LongParagraphScripts(benchmark::State& state) { LongRender(state, true); }

void BM_TitleStrokeShadow(benchmark::State& state) { Render(state, kTitleScene); }
void BM_ParagraphStrokeShadow(benchmark::State& state) { Render(state, kParagraphScene); }
void BM_TitleStrokeShadowExact(benchmark::State& state) { Render(state, kTitleScene, true); }

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
BENCHMARK(BM_TitleStrokeShadowExact)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_TitleTextOnly)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ParagraphTextOnly)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_LongParagraphLatin)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_LongParagraphScripts)->Unit(benchmark::kMillisecond);

}  // namespace
