// Glimmer beside libass on the same titles, in one process.
//
// Four scenes, all DejaVu Sans Bold on a transparent background:
//   S0   "Glimmer Effects 2026", 96 px, black fill, 1280 x 200, no effect;
//   S1p  S0 plus an outside stroke of 4 px in red and an outer shadow moved by
//        (6, 6) (angle 135, distance 8), size 8, black at 60 %;
//   S2p  the same text on 1320 x 240 with an outer glow of size 20 in gold;
//   S3p  a six-line pangram at 48 px on 1000 x 400, outside stroke 2 and an
//        outer shadow moved by (3, 3) with size 4.
// Glimmer renders each frame in full through the text object (layout, glyph
// masks, every effect, the final picture). libass renders the same text with
// the nearest tags it has (\bord, \shad, \blur) and is kept cold: its font
// scale changes by a part in 10^7 every frame, so no outline, bitmap or
// composite of an earlier frame can be reused. Its result is a list of
// coverage images, which this program does not blend.
//
// Frames alternate between the two engines on one core; the table gives the
// median time of each, their ratio and, when valgrind is installed, the
// instructions per frame that callgrind counts (each engine run apart, in a
// child process; valgrind runs no AVX-512, so there the kernels take their
// AVX2 build). "allocs" is the number of heap allocations a Glimmer frame
// makes once the text object has rendered the same size before: shaping and
// glyph drawing, and whatever the effect layers still allocate.
//
//   compare_bench [--frames N] [--scene NAME] [--no-instructions] [--smoke]
//   compare_bench --hash      one Glimmer frame a scene, a hash of its pixels

#include <ass/ass.h>
#include <sched.h>
#if __has_include(<valgrind/callgrind.h>)
#include <valgrind/callgrind.h>
#else
#define CALLGRIND_TOGGLE_COLLECT
#endif
#include <unistd.h>

#include <algorithm>
#include <cstdarg>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <memory>
#include <string>
#include <vector>

#include "AllocationCounter.h"
#include "effect/GxEffect.h"
#include "font/SystemFontFamilies.h"
#include "foundation/List.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"

namespace {

using Clock = std::chrono::steady_clock;
using namespace Glimmer;

constexpr const char* kFont = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";
// An ASS font size is the line height (ascent + descent), not the em:
// DejaVu Sans Bold's is 1.164 em.
constexpr double kAssSizePerEm = 1.164;

struct Scene {
    const char* name;
    const wchar_t* text;  // lines separated by \n
    const char* assText;  // the same with \N
    float size;
    int width, height;
    int lines, lineHeight, firstBaseline;
    float stroke;                     // outside stroke width, 0: none
    float shadowDistance, shadowSize;  // outer shadow at angle 135, 0: none
    float shadowOpacity;
    float glow;                       // outer glow size in gold, 0: none
};

const wchar_t kPangram[] =
    L"The quick brown fox jumps over the lazy dog.\n"
    L"Pack my box with five dozen liquor jugs!\n"
    L"How vexingly quick daft zebras jump.\n"
    L"Sphinx of black quartz, judge my vow.\n"
    L"The five boxing wizards jump quickly.\n"
    L"Jackdaws love my big sphinx of quartz.";
const char kAssPangram[] =
    "The quick brown fox jumps over the lazy dog.\\N"
    "Pack my box with five dozen liquor jugs!\\N"
    "How vexingly quick daft zebras jump.\\N"
    "Sphinx of black quartz, judge my vow.\\N"
    "The five boxing wizards jump quickly.\\N"
    "Jackdaws love my big sphinx of quartz.";

const Scene kScenes[] = {
    {"S0", L"Glimmer Effects 2026", "Glimmer Effects 2026", 96, 1280, 200, 1, 120, 130, 0, 0, 0, 0, 0},
    {"S1p", L"Glimmer Effects 2026", "Glimmer Effects 2026", 96, 1280, 200, 1, 120, 130, 4, 8, 8, 0.6f, 0},
    {"S2p", L"Glimmer Effects 2026", "Glimmer Effects 2026", 96, 1320, 240, 1, 120, 150, 0, 0, 0, 0, 20},
    {"S3p", kPangram, kAssPangram, 48, 1000, 400, 6, 60, 50, 2, 4.25f, 4, 0.75f, 0},
};

// ---- Glimmer

struct GlimmerScene {
    std::unique_ptr<GxTextObject> text;
    int width = 0, height = 0;
};

GlimmerScene MakeGlimmer(const Scene& s) {
    GlimmerScene g;
    g.text = std::make_unique<GxTextObject>();
    GxTextObject& text = *g.text;
    text.Construct();
    text.SetFont(kFont);
    text.SetText(s.text);
    Platform::Paint paint;
    paint.size = s.size;
    text.SetPaint(paint);
    text.SetTextColor(0xFF000000u);
    GxEffect* effect = text.GetEffect();
    if (s.stroke > 0) effect->addStrokeText(s.stroke, 0xFFFF0000u, 1.0f, 0, 1);
    if (s.shadowSize > 0)
        effect->addOuterShadowText(135.0f, s.shadowDistance, s.shadowSize, 0xFF000000u, s.shadowOpacity);
    if (s.glow > 0) effect->addOuterGlowText(s.glow, 0xFFFFD700u, 1.0f, 0, nullptr);

    // One record per line, each the length of its text line.
    List lines;
    lines.Construct();
    const std::wstring all(s.text);
    size_t start = 0;
    for (int i = 0; i < s.lines; ++i) {
        size_t end = all.find(L'\n', start);
        if (end == std::wstring::npos) end = all.size();
        auto* line = new GxLineInfo();
        line->start = int(start);
        line->end = int(end);
        line->x = 20;
        line->baseline = s.firstBaseline + i * s.lineHeight;
        line->bounds = GxRect(20, line->baseline - s.lineHeight * 3 / 4, s.width - 20,
                              line->baseline + s.lineHeight / 4);
        lines.Add(line);
        start = end + 1;
    }
    text.SetLineInfo(&lines);
    g.width = s.width + effect->getLeftOffset() + effect->getRightOffset();
    g.height = s.height + effect->getTopOffset() + effect->getBottomOffset();
    text.GetView()->SetSize(s.width, s.height);
    text.GetView()->SetBitmapWidth(g.width);
    text.GetView()->SetBitmapHeight(g.height);
    return g;
}

__attribute__((noinline)) const unsigned* GlimmerFrame(GlimmerScene& g) {
    return g.text->RenderTextEffect(g.width, g.height);
}

// ---- libass

struct AssScene {
    ASS_Library* library = nullptr;
    ASS_Renderer* renderer = nullptr;
    ASS_Track* track = nullptr;
    long frame = 0;
    ~AssScene() {
        if (track) ass_free_track(track);
        if (renderer) ass_renderer_done(renderer);
        if (library) ass_library_done(library);
    }
};

std::string AssScript(const Scene& s) {
    char tags[256];
    const double shadow = s.shadowDistance * 0.7071;  // angle 135: equal x and y
    if (s.glow > 0) {
        // A glow is a wide soft border in the glow colour.
        std::snprintf(tags, sizeof tags, "{\\bord%.0f\\blur%.1f\\3c&H00D7FF&\\shad0}", s.glow / 2,
                      s.glow / 3);
    } else {
        std::snprintf(tags, sizeof tags,
                      "{\\bord%.0f\\3c&H0000FF&\\xshad%.0f\\yshad%.0f\\4c&H000000&\\4a&H%02X&\\blur%.1f}",
                      s.stroke, shadow, shadow, unsigned(255 - int(s.shadowOpacity * 255 + 0.5f)),
                      s.shadowSize / 3);
    }
    char script[4096];
    std::snprintf(script, sizeof script,
                  "[Script Info]\nScriptType: v4.00+\nPlayResX: %d\nPlayResY: %d\nWrapStyle: 2\n"
                  "ScaledBorderAndShadow: yes\n\n"
                  "[V4+ Styles]\nFormat: Name, Fontname, Fontsize, PrimaryColour, SecondaryColour, "
                  "OutlineColour, BackColour, Bold, Italic, Underline, StrikeOut, ScaleX, ScaleY, "
                  "Spacing, Angle, BorderStyle, Outline, Shadow, Alignment, MarginL, MarginR, MarginV, "
                  "Encoding\n"
                  "Style: Default,DejaVu Sans,%.2f,&H00000000,&H00000000,&H000000FF,&H66000000,-1,0,0,0,"
                  "100,100,0,0,1,0,0,7,20,20,%d,1\n\n"
                  "[Events]\nFormat: Layer, Start, End, Style, Name, MarginL, MarginR, MarginV, Effect, "
                  "Text\nDialogue: 0,0:00:00.00,9:00:00.00,Default,,0,0,0,,%s%s\n",
                  s.width, s.height, s.size * kAssSizePerEm, s.firstBaseline - int(s.size),
                  tags, s.assText);
    return script;
}

std::unique_ptr<AssScene> MakeAss(const Scene& s) {
    auto a = std::make_unique<AssScene>();
    a->library = ass_library_init();
    if (a->library == nullptr) return nullptr;
    ass_set_message_cb(a->library, [](int, const char*, va_list, void*) {}, nullptr);
    a->renderer = ass_renderer_init(a->library);
    if (a->renderer == nullptr) return nullptr;
    ass_set_frame_size(a->renderer, s.width, s.height);
    ass_set_storage_size(a->renderer, s.width, s.height);
    ass_set_fonts(a->renderer, kFont, "DejaVu Sans", ASS_FONTPROVIDER_NONE, nullptr, 0);
    std::string script = AssScript(s);
    a->track = ass_read_memory(a->library, script.data(), script.size(), nullptr);
    if (a->track == nullptr) return nullptr;
    return a;
}

__attribute__((noinline)) ASS_Image* AssFrame(AssScene& a) {
    // A new scale every frame: nothing cached from an earlier frame fits.
    ass_set_font_scale(a.renderer, 1.0 + double(++a.frame % 100000) * 1e-7);
    int changed = 0;
    return ass_render_frame(a.renderer, a.track, 1000, &changed);
}

// ---- measuring

double Median(std::vector<double> v) {
    std::sort(v.begin(), v.end());
    if (v.empty()) return 0;
    return v.size() % 2 ? v[v.size() / 2] : (v[v.size() / 2 - 1] + v[v.size() / 2]) / 2;
}

template <typename F>
double TimeMs(F&& f) {
    const auto t0 = Clock::now();
    f();
    return std::chrono::duration<double, std::milli>(Clock::now() - t0).count();
}

// Instructions per frame under callgrind, counting only the frames of one
// engine after a first one; -1 when valgrind is missing or fails.
double CallgrindInstructions(const char* self, const Scene& s, const char* engine, int frames) {
    if (std::system("command -v valgrind >/dev/null 2>&1") != 0) return -1;
    char out[] = "/tmp/compare_bench.XXXXXX";
    const int fd = mkstemp(out);
    if (fd < 0) return -1;
    close(fd);
    const std::string command = std::string("valgrind --tool=callgrind --collect-atstart=no") +
                                " --callgrind-out-file=" + out + " '" + self + "' --count " +
                                engine + " " + s.name + " " + std::to_string(frames) +
                                " >/dev/null 2>&1";
    double result = -1;
    if (std::system(command.c_str()) == 0) {
        std::ifstream file(out);
        std::string line;
        while (std::getline(file, line)) {
            if (line.rfind("totals:", 0) == 0 || line.rfind("summary:", 0) == 0) {
                result = std::strtod(line.c_str() + line.find(':') + 1, nullptr) / frames;
                break;
            }
        }
    }
    std::remove(out);
    return result;
}

const Scene* FindScene(const char* name) {
    for (const Scene& s : kScenes)
        if (std::strcmp(s.name, name) == 0) return &s;
    return nullptr;
}

// Child mode for callgrind: one warm-up frame uncounted, then `frames`.
int CountFrames(const char* engine, const char* sceneName, int frames) {
    const Scene* s = FindScene(sceneName);
    if (s == nullptr) return 2;
    if (std::strcmp(engine, "glimmer") == 0) {
        GlimmerScene g = MakeGlimmer(*s);
        GlimmerFrame(g);
        CALLGRIND_TOGGLE_COLLECT;
        for (int i = 0; i < frames; ++i) GlimmerFrame(g);
        CALLGRIND_TOGGLE_COLLECT;
    } else {
        std::unique_ptr<AssScene> a = MakeAss(*s);
        if (!a) return 1;
        AssFrame(*a);
        CALLGRIND_TOGGLE_COLLECT;
        for (int i = 0; i < frames; ++i) AssFrame(*a);
        CALLGRIND_TOGGLE_COLLECT;
    }
    return 0;
}

std::string Millions(double v) {
    if (v < 0) return "n/a";
    char text[32];
    std::snprintf(text, sizeof text, "%.1f M", v / 1e6);
    return text;
}

}  // namespace

int main(int argc, char** argv) {
    int frames = 200;
    const char* only = nullptr;
    bool instructions = true, smoke = false;
    for (int i = 1; i < argc; ++i) {
        if (!std::strcmp(argv[i], "--count") && i + 3 < argc)
            return CountFrames(argv[i + 1], argv[i + 2], std::atoi(argv[i + 3]));
        if (!std::strcmp(argv[i], "--frames") && i + 1 < argc) {
            frames = std::max(1, std::atoi(argv[++i]));
        } else if (!std::strcmp(argv[i], "--scene") && i + 1 < argc) {
            only = argv[++i];
        } else if (!std::strcmp(argv[i], "--no-instructions")) {
            instructions = false;
        } else if (!std::strcmp(argv[i], "--smoke")) {
            smoke = true;
        } else if (!std::strcmp(argv[i], "--hash")) {
            // To check that a change of the engine leaves every byte as it was.
            InstallSystemFontFamilies();
            for (const Scene& s : kScenes) {
                GlimmerScene g = MakeGlimmer(s);
                const unsigned* pixels = GlimmerFrame(g);
                uint64_t hash = 1469598103934665603ull;  // FNV-1a
                for (size_t k = 0; pixels != nullptr && k < size_t(g.width) * g.height; ++k)
                    hash = (hash ^ pixels[k]) * 1099511628211ull;
                std::printf("%-5s %dx%d %016llx\n", s.name, g.width, g.height, (unsigned long long)hash);
            }
            return 0;
        } else {
            std::fprintf(stderr, "usage: %s [--frames N] [--scene NAME] [--no-instructions] [--smoke] | --hash\n",
                         argv[0]);
            return 2;
        }
    }
    if (smoke) {
        frames = 1;
        instructions = false;
    }

    // One core, the one we started on.
    const int cpu = sched_getcpu();
    if (cpu >= 0) {
        cpu_set_t set;
        CPU_ZERO(&set);
        CPU_SET(cpu, &set);
        sched_setaffinity(0, sizeof set, &set);
    }
    InstallSystemFontFamilies();

    std::printf("%-5s %10s %12s %8s %10s %10s %8s\n", "scene", "libass ms", "Glimmer ms", "ratio",
                "libass in", "Glimmer in", "allocs");
    for (const Scene& s : kScenes) {
        if (only != nullptr && std::strcmp(only, s.name) != 0) continue;
        GlimmerScene g = MakeGlimmer(s);
        std::unique_ptr<AssScene> a = MakeAss(s);
        if (!a || GlimmerFrame(g) == nullptr || AssFrame(*a) == nullptr) {
            std::fprintf(stderr, "%s: a renderer failed\n", s.name);
            return 1;
        }
        // Allocations of a frame of a size rendered before (twice: the text
        // object's two images take turns).
        GlimmerFrame(g);
        const long allocations = Bench::AllocationsOf([&] { GlimmerFrame(g); });

        std::vector<double> glimmer, ass;
        for (int i = 0; i < frames; ++i) {
            glimmer.push_back(TimeMs([&] { GlimmerFrame(g); }));
            ass.push_back(TimeMs([&] { AssFrame(*a); }));
        }
        const double gm = Median(glimmer), am = Median(ass);
        const int counted = std::max(1, std::min(frames, 10));
        const double gi = instructions ? CallgrindInstructions(argv[0], s, "glimmer", counted) : -1;
        const double ai = instructions ? CallgrindInstructions(argv[0], s, "libass", counted) : -1;
        std::printf("%-5s %10.3f %12.3f %7.1fx %10s %10s %8ld\n", s.name, am, gm, am > 0 ? gm / am : 0.0,
                    Millions(ai).c_str(), Millions(gi).c_str(), allocations);
    }
    return 0;
}
