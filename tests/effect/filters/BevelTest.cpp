// The bevel layer: radii and margins, its record and offset, exact bytes on
// tiny masks, and its blend mode. Properties shared with the emboss are in
// ReliefTest.cpp.

#include <gtest/gtest.h>

#include "ReliefTestSupport.h"
#include "effect/GxEffect.h"
#include "effect/filters/GxBevel.h"

namespace Glimmer {
namespace {

using namespace Testing;

TEST(Bevel, RadiusSelection) {
    struct Row { float size; int technique, soften, rs, rd, margin; bool exact; };
    for (Row r : {Row{15, 0, 0, 11, 11, 33, true},   // 2 * 15 / 3 + 1 = 11
                  Row{14, 0, 0, 11, 11, 33, true},   // 28 / 3 + 1 = 10.33: a real division
                  Row{13, 0, 0, 10, 10, 30, false},  // 26 / 3 + 1 = 9.67
                  Row{3, 0, 5, 3, 3, 13, false},     // soften wider than the smoothing
                  Row{10, 1, 0, 0, 12, 12, false},   // hard: r + 2, never exact
                  Row{60, 1, 16, 0, 62, 94, false},
                  Row{-7, 0, 0, 1, 1, 3, false}}) {  // negative sizes act as 0
        const GxBevelGeometry g = GxBevel::geometry(MakeRecord<GxBevelProperty>(Relief(1, r.technique, r.size, r.soften)));
        EXPECT_TRUE(g.drawable && g.smoothRadius == r.rs && g.range == r.rd && g.margin == r.margin &&
                    g.exact == r.exact && g.gain == (r.technique == 0 ? 1.83f : 1.0f))
            << "size " << r.size << " technique " << r.technique;
    }
    EXPECT_FALSE(GxBevel::geometry(MakeRecord<GxBevelProperty>(Relief(1, 0, 1e9f))).drawable);
}

TEST(Bevel, KeepsARecordCopyAndPadsTheCanvas) {
    GxBevel bevel;
    EXPECT_EQ(bevel.getStyle(), 5);
    ReliefParams p = Relief(1, 0, 4.6f, 3);
    p.angle = 400.0f;
    GxBevelProperty record = MakeRecord<GxBevelProperty>(p);
    bevel.setProperty(&record);
    auto* kept = static_cast<GxBevelProperty*>(bevel.getProperty());
    ASSERT_TRUE(kept != nullptr && kept != &record);
    EXPECT_EQ(kept->angle, 40.0f);
    EXPECT_EQ(bevel.getOffset(), 3 + 5);  // soften + int(4.6 + 0.5)
    GxTextProperty text(0xFF000000, 1.0f);
    bevel.setProperty(nullptr);  // ignored, as is a record of another kind
    bevel.setProperty(&text);
    EXPECT_EQ(bevel.getProperty(), kept);

    GxEffect stack;  // through the stack's factory
    ASSERT_GE(stack.addBevelText(1, 2.0f, 6.4f, 1, 0, 2, 1.0f, 120.0f, 30.0f, 0xFFFFFFFF, 1.0f, 0xFF000000, 1.0f), 0);
    EXPECT_EQ(stack.getLeftOffset(), 2 + 6);
}

// Hard bevels of size 0 (Rd = 2, no blur, gain 1), light along +x (angle 180,
// altitude 0: exact components), depth 10 (normalZ 0.24). The frames were
// derived step by step from the rules in single precision (edge fractions
// m / 254.99, nearest v + root within Rd, central differences, fsqrt, edge
// factor, plane writes, the stronger wash). Signed alphas: + red (first
// colour), - blue (second).
TEST(Bevel, SmallHardBevelsByteForByte) {
    ReliefParams p = Relief(0, 1, 0);
    p.depth = 10;
    p.angle = 180;
    p.altitude = 0;
    {
        const uint8_t text[2][2] = {{255, 128}, {96, 255}};
        const int expect[6][6] = {{0, 0, 0, 0, 0, 0},         {0, -149, -255, -1, 5, 0},
                                  {0, -255, -255, 95, 96, 0}, {0, -149, -255, -13, 241, 0},
                                  {0, 0, -149, -255, 49, 0},  {0, 0, 0, 0, 0, 0}};
        ReliefCanvas c(2, 2, 2);
        c.SetText(text);
        c.Run<GxBevel, GxBevelProperty>(p);
        for (int y = 0; y < 6; ++y)
            for (int x = 0; x < 6; ++x) EXPECT_EQ(SignedAlpha(c.Pixel(x, y)), expect[y][x]) << x << "," << y;
    }
    {
        p.style = 1;
        // The faint centre (21) is where 254.99 and 254.999 part ways.
        const uint8_t text[4][3] = {{255, 255, 255}, {255, 21, 255}, {255, 255, 255}, {40, 255, 0}};
        const int expect[8][7] = {{0, 0, 0, 0, 0, 0, 0},           {0, 255, 255, 255, 255, 255, 0},
                                  {0, -203, -85, 255, 255, 255, 0},  {0, -203, 169, 255, 255, 255, 0},
                                  {0, -203, -123, 234, 255, 255, 0}, {0, 97, -85, 255, 255, 255, 0},
                                  {0, 255, 255, 255, 255, 255, 0},   {0, 0, 0, 0, 0, 0, 0}};
        ReliefCanvas c(3, 4, 2);
        c.SetText(text);
        c.Run<GxBevel, GxBevelProperty>(p);
        for (int y = 0; y < 8; ++y)
            for (int x = 0; x < 7; ++x) EXPECT_EQ(SignedAlpha(c.Pixel(x, y)), expect[y][x]) << x << "," << y;
    }
}

TEST(Bevel, SourceOverOnlyWithAWorkImageAndNeverIntoExtra) {
    for (int separate : {0, 1}) {
        ReliefCanvas c(12, 12, 14);
        c.FillSquare(3);
        for (size_t i = 0; i < c.DstBytes(); ++i) c.dst.pixels[i] = i % 4 == 3 ? 255 : 128;
        GxBitmap before(c.dst), extra(c.dst.width, c.dst.height, 4), empty(extra);
        c.Run<GxBevel, GxBevelProperty>(Relief(0, 0, 5), separate, &extra);
        // Destination-over onto an opaque target changes nothing; source-over does.
        EXPECT_EQ(SamePixels(before, c.dst), separate == 0);
        EXPECT_TRUE(SamePixels(extra, empty));
    }
}

}  // namespace
}  // namespace Glimmer
