// The glows: the colour table and the box spread they share, margins and the
// edges. Their pixels are pinned by the picture table. (A glow that kept the
// caller's stops would read freed memory in every picture with stops under
// ASan: the stack frees its copy once the layer has its own.)

#include <gtest/gtest.h>

#include <cstdint>
#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxInnerGlow.h"
#include "effect/filters/GxOuterGlow.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using Testing::LayerCanvas;
using Testing::Stop;

constexpr uint32_t kRed = 0xFFFF0000u, kGreen = 0xFF00FF00u, kBlue = 0xFF0000FFu, kBlack = 0xFF000000u,
                   kWhite = 0xFFFFFFFFu;

template <typename Layer = GxOuterGlow, typename Record = GxOuterGlowProperty>
std::unique_ptr<Layer> Glow(float size, uint32_t color, std::vector<GxGradient> stops = {}) {
    auto glow = std::make_unique<Layer>();
    Record record(size, color, 1.0f, int32_t(stops.size()), stops.empty() ? nullptr : stops.data());
    glow->setProperty(&record);
    return glow;
}

auto Inner(float size, uint32_t color) { return Glow<GxInnerGlow, GxInnerGlowProperty>(size, color); }

// The layers build their table with the fade from 0.3 and a linear ramp.
TEST(GlowColorTable, SingleColourRampsAndTheFade) {
    const std::vector<GxGradient> bw{Stop(kBlack, 0), Stop(kWhite, 1)};
    const struct {
        float size;
        std::vector<GxGradient> stops;
        int entry;
        uint32_t expected;
        const char* why;
    } cases[] = {
        {0, {}, 10, 0u, "size 0: all transparent"},
        // k = trunc(double(0.3f) * 256) = 76 keeps its alpha; then 255 * trunc((256 - j) * 256 / 180) >> 8.
        {5, {}, 76, kRed, "the fade starts after entry 76"},
        {5, {}, 77, 0xFDFF0000u, "first faded entry"},
        {5, {}, 256, 0u, "the last entry is wholly transparent"},
        {5, {Stop(kGreen, 0.7f)}, 1, kGreen, "one stop: its colour, not the glow's"},
        {5, bw, 64, 0xFF3F3F3Fu, "(255 * 64) >> 8"},
        {5, {Stop(0x00000000u, 0.5f), Stop(kWhite, 1)}, 64, 0x3F3F3F3Fu,
         "the first segment runs from 0 whatever stop 0's position; alpha mixes too"},
        // Stops closer than 1/256: one stop per entry, so the table lags behind t.
        {5, {Stop(kRed, 0), Stop(kGreen, 0.001f), Stop(kBlue, 0.002f), Stop(kBlack, 0.003f), Stop(kWhite, 1)},
         3, 0xFF010101u, "f = trunc((3/256 - 0.003) / 0.997 * 256) = 2"},
        {5, {Stop(kBlack, 0), Stop(kWhite, 0.25f)}, 70, kWhite, "past the last stop: its colour"},
    };
    for (const auto& c : cases) {
        std::vector<uint32_t> table(257, 0xDEADBEEFu);
        Glow(c.size, kRed, c.stops)->makeColorLUT(table.data(), 0.3f, 0);
        EXPECT_EQ(table[c.entry], c.expected) << c.why << " (entry " << c.entry << ")";
    }
    GxOuterGlowProperty nullStops(5.0f, kRed, 1.0f, 3, nullptr);
    uint32_t table[257];
    MakeGlowColorTable(table, &nullStops, 0.3f, 0);
    EXPECT_EQ(table[10], kRed) << "null stops with a count must give the glow's colour";
}

TEST(GlowBoxFilter, TheContentBoxGivesTheWholePlaneResult) {
    // Told where the content lies on a frame of 0 or 255, the spread rewrites
    // less and must give the same bytes, row ends and small planes included.
    // (The bytes of the whole-plane spread are pinned by the picture table.)
    std::mt19937 rng(3);
    for (int trial = 0; trial < 60; ++trial) {
        const int w = 1 + int(rng() % 40), h = 3 + int(rng() % 30);
        const uint8_t frame = trial % 2 ? 255 : 0;
        const int left = int(rng() % unsigned(w)), top = int(rng() % unsigned(h));
        const GxRect content(left, top, left + 1 + int(rng() % unsigned(w - left)),
                             top + 1 + int(rng() % unsigned(h - top)));
        std::vector<unsigned char> whole(size_t(w) * h, frame);
        for (int y = content.top; y < content.bottom; ++y)
            for (int x = content.left; x < content.right; ++x) whole[y * w + x] = rng() % 3 ? uint8_t(rng()) : frame;
        std::vector<unsigned char> part = whole;
        const int passes = 1 + int(rng() % 6);
        ASSERT_TRUE(GlowBoxFilter(whole.data(), passes, w, h, nullptr));
        ASSERT_TRUE(GlowBoxFilter(part.data(), passes, w, h, nullptr, content));
        ASSERT_EQ(part, whole) << "the content-box spread differs, trial " << trial;
    }
}

TEST(Glows, MarginsSizesThatDrawNothingAndTheCanvasEdges) {
    EXPECT_EQ(Glow(2.4f, kRed)->getOffset(), 2);
    EXPECT_EQ(Glow(2.5f, kRed)->getOffset(), 3) << "the margin is the size rounded half up";
    for (float size : {0.0f, -1.5f, -7.0f}) {
        EXPECT_TRUE(LayerCanvas(15, 15).Glyph(4, 4, 11, 11).Run(*Glow(size, kRed)).Untouched()) << size;
        EXPECT_TRUE(LayerCanvas(15, 15).Glyph(4, 4, 11, 11).Run(*Inner(size, kRed)).Untouched()) << size;
    }
    auto big = Glow(6.0f, kRed);
    LayerCanvas exact(10, 10), hanging(10, 10), away(10, 10);
    exact.Glyph(6, 6, 10, 10).Run(*big);
    hanging.Glyph(6, 6, 10, 10).box = GxRect(6, 6, 40, 40);
    EXPECT_TRUE(hanging.Run(*big).SameAs(exact)) << "a box past the canvas must act as the box clipped to it";
    away.box = GxRect(20, 20, 30, 30);
    EXPECT_TRUE(away.Run(*big).Untouched());
    GxBitmap tiny(2, 2, 4);  // a destination smaller than the glow image
    GxECore::ParamPostProcessing pp{&tiny, &exact.mask, &exact.box, 0, nullptr};
    big->doPostProcessing(&pp);
    big->doPostProcessing(nullptr);
}

}  // namespace
}  // namespace Glimmer
