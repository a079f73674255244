// The bevel and emboss layers: radii and margins, records and offsets,
// exact bytes on tiny masks, the emboss's passes by hand and its two-sided
// style, and each layer's blend mode. Properties both must have are in
// ReliefTest.cpp.

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "effect/GxEffect.h"
#include "effect/filters/GxBevel.h"
#include "effect/filters/GxEmboss.h"
#include "effect/filters/LayerHarness.h"

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
                  Row{-1, 1, 0, 0, 1, 1, false},     // int(size) toward zero: r = -1, Rd = 1
                  Row{-1, 0, 0, 1, 1, 3, false},     // ceil(-2 / 3 + 1)
                  Row{-3, 1, 1, 0, -1, 1, false}}) { // a negative range only empties the windows
        const GxBevelGeometry g = GxBevel::geometry(MakeRecord<GxBevelProperty>(Relief(1, r.technique, r.size, r.soften)));
        EXPECT_TRUE(g.drawable && g.smoothRadius == r.rs && g.range == r.rd && g.margin == r.margin &&
                    g.exact == r.exact && g.gain == (r.technique == 0 ? 1.83f : 1.0f))
            << "size " << r.size << " technique " << r.technique;
    }
    // Refused: past the radius limit, a frame smaller than the text, a blur
    // radius below zero. Margins stay what the size gives, at least 0.
    for (ReliefParams p : {Relief(1, 0, 1e9f), Relief(1, 1, -3), Relief(1, 0, -3, 4)}) {
        EXPECT_FALSE(GxBevel::geometry(MakeRecord<GxBevelProperty>(p)).drawable) << p.size;
    }
    GxBevel bevel;
    GxBevelProperty record = MakeRecord<GxBevelProperty>(Relief(1, 0, -3, 4));
    bevel.setProperty(&record);
    EXPECT_EQ(bevel.getOffset(), 4 - 2);  // soften + int(-2.5)
    record = MakeRecord<GxBevelProperty>(Relief(1, 0, -9, 4));
    bevel.setProperty(&record);
    EXPECT_EQ(bevel.getOffset(), 0);
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
        ExpectSignedAlphas(c, expect);
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
        ExpectSignedAlphas(c, expect);
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

TEST(Emboss, RadiusSelectionAndOffset) {
    struct Row { float size; int technique, soften, ro, ri, rs, margin; bool exact; };
    for (Row r : {Row{10, 1, 0, 8, 6, 0, 8, false},     // ceil(5 + 3), ceil(5 + 1)
                  Row{11, 1, 5, 9, 7, 0, 19, false},    // h = 5.5
                  Row{25, 0, 0, 8, 8, 14, 36, false},   // local passes up to 25
                  Row{26, 0, 16, 8, 8, 14, 40, true},   // the exact transform from 26
                  Row{26, 2, 0, 16, 14, 0, 16, false},
                  Row{-2, 1, 0, 2, 0, 0, 2, false},     // r = -2, h = -1: ceil(2), ceil(0)
                  Row{-9, 1, 2, -1, -3, 0, 3, false},   // negative ranges, frame from soften
                  Row{-3, 0, 0, 1, 1, 0, 1, false}}) {  // smoothing radius 0 still smooths
        const GxEmbossGeometry g =
            GxEmboss::geometry(MakeRecord<GxEmbossProperty>(Relief(0, r.technique, r.size, r.soften)));
        EXPECT_TRUE(g.drawable && g.outRange == r.ro && g.inRange == r.ri && g.smoothRadius == r.rs &&
                    g.margin == r.margin && g.exact == r.exact && g.gain == (r.technique == 0 ? 2.03f : 1.0f))
            << "size " << r.size << " technique " << r.technique;
    }
    GxEmboss emboss;
    EXPECT_EQ(emboss.getStyle(), 6);
    GxEmbossProperty record = MakeRecord<GxEmbossProperty>(Relief(0, 0, 10.5f, 2));
    emboss.setProperty(&record);
    EXPECT_NE(emboss.getProperty(), &record);
    EXPECT_EQ(emboss.getOffset(), 7 + 2);  // ceil(5.25 + 1): int(10.5) would give 6
    for (ReliefParams p : {Relief(0, 1, -9), Relief(0, 0, -4, 3)}) {  // M < 0; Rs = -1
        EXPECT_FALSE(GxEmboss::geometry(MakeRecord<GxEmbossProperty>(p)).drawable) << p.size;
        record = MakeRecord<GxEmbossProperty>(p);
        emboss.setProperty(&record);
        EXPECT_EQ(emboss.getOffset(), p.size == -9 ? 0 : 3 - 1);  // ceil(-4.5 + 1) = -3; ceil(-1) + 3
    }
}

TEST(Emboss, LocalPassesByHand) {
    // Ro = 8, Ri = 6: outside 8, an edge pixel at 0.5, the inside floor 1 - 6.
    std::vector<float> field = {8, 8, 8, 0.5f, -5, -5};
    GxEmboss::DistanceJob job{field.data(), 1, 6, 8, 6, 0, 1};
    GxEmboss::partialOutDT(&job);  // nearest 0.5 + distance (edge) or distance alone (inside)
    EXPECT_EQ(field, (std::vector<float>{3.5f, 2.5f, 1.5f, 0.5f, -5, -5}));
    GxEmboss::partialInDT(&job);  // largest v - distance over the values above 1
    EXPECT_EQ(field, (std::vector<float>{3.5f, 2.5f, 1.5f, 0.5f, -0.5f, -1.5f}));
}

// The soft job on ramps of slope 1 along x, light (1, 0, 0), normalZ 2.4:
// outward, L = 1 / fsqrt(6.76) * 255 = 98.1; inward, the distance is a
// descending height, so the level is (1 + 0.385) * 255, capped at 255.
TEST(Emboss, SoftLightJobByHand) {
    std::vector<float> ramp, zero(12, 0.0f);
    for (int y = 0; y < 3; ++y) ramp.insert(ramp.end(), {0.5f, 1.5f, 2.5f, 3.5f});
    std::vector<uint8_t> second(12, 0x77), first(12, 0x77);
    GxEmboss::LightJob job{second.data(), first.data(), ramp.data(), zero.data(), 4, 6, 2, 2.4f,
                           1.0f, 0.0f, 0.0f, 255, 255, 1, 3, 1, 2};
    GxEmboss::partialLightSoftProcess(&job);
    EXPECT_EQ(second[5], 157);  // ((158 * 255 >> 8) + 1) * 255 >> 8
    EXPECT_EQ(first[5], 98);    // ((99 * 255 >> 8) + 1) * 255 >> 8
    job.field = zero.data();
    job.innerField = ramp.data();
    std::fill(second.begin(), second.end(), 0x77);
    GxEmboss::partialLightSoftProcess(&job);
    EXPECT_EQ(second[5], 128);  // I = 1.5: edge factor of Ri - I = 128
    EXPECT_EQ(first[5], 0);
    EXPECT_EQ(second[6], 0x77);  // I = 2.5 is not below Ri
}

// A hard emboss of size 2 (Ro = 4, Ri = 2, no blur, gain 1), light along +x,
// depth 10, derived step by step as the bevel's: signed field (Ro,
// 1 - m / 254.999, 1 - Ri), outward then inward pass from row 1, hard
// lighting, the stronger wash. The edge value 81 is one where 254.999 and
// 254.99 part ways.
TEST(Emboss, SmallHardEmbossByteForByte) {
    ReliefParams p = Relief(0, 1, 2);
    p.depth = 10;
    p.angle = 180;
    p.altitude = 0;
    const uint8_t text[2][2] = {{255, 81}, {96, 255}};
    const int expect[10][10] = {{0, 0, 0, 0, 0, 0, 0, 0, 0, 0},
                                {0, 0, -100, -214, -255, -80, 10, 0, 0, 0},
                                {0, -100, -255, -255, -255, -43, 65, 44, 0, 0},
                                {0, -214, -255, -255, -255, 29, 95, 123, 54, 0},
                                {0, -255, -255, -255, -255, 95, 149, 193, 176, 0},
                                {0, -214, -255, -255, -255, 23, 241, 241, 241, 0},
                                {0, -100, -255, -255, -255, -255, 91, 193, 176, 0},
                                {0, 0, -140, -255, -255, -255, -43, 95, 54, 0},
                                {0, 0, 0, -100, -214, -255, -80, 10, 0, 0},
                                {0, 0, 0, 0, 0, 0, 0, 0, 0, 0}};
    ReliefCanvas c(2, 2, 4);
    c.SetText(text);
    c.Run<GxEmboss, GxEmbossProperty>(p);
    ExpectSignedAlphas(c, expect);
}

// Style 3 lays the normally lit relief, weighted by the coverage it reads
// (strictly inside the text rectangle's first row and column), over the
// oppositely lit one: where that coverage is 0 it is the plain emboss with
// direction 0, where it is 255 the plain one with direction 1.
TEST(Emboss, TwoSidedStyleAgainstThePlainOne) {
    for (ReliefParams p : {Relief(3, 1, 6), Relief(3, 0, 8, 2), Relief(3, 0, 26)}) {
        ReliefCanvas two(16, 14, GxEmboss::geometry(MakeRecord<GxEmbossProperty>(p)).margin + 1);
        two.FillPointSymmetric(31);
        ReliefCanvas normal = two, mirrored = two;
        two.Run<GxEmboss, GxEmbossProperty>(p);
        p.style = 0;
        normal.Run<GxEmboss, GxEmbossProperty>(p);
        p.direction = 0;
        mirrored.Run<GxEmboss, GxEmbossProperty>(p);
        const GxRect& r = two.rect;
        int full = 0;
        for (int y = 0; y < int(two.dst.height); ++y) {
            for (int x = 0; x < int(two.dst.width); ++x) {
                const int m = x > r.left && x < r.right && y > r.top && y < r.bottom ? two.Mask(x, y) : 0;
                const ReliefCanvas* same = m == 0 ? &mirrored : m == 255 ? &normal : nullptr;
                if (same != nullptr) {
                    ASSERT_EQ(std::memcmp(two.Pixel(x, y), same->Pixel(x, y), 4), 0) << x << "," << y;
                }
                full += m == 255;
            }
        }
        EXPECT_GT(full, 20);
        EXPECT_GT(mirrored.DrawnPixels(), 50);
    }
}

TEST(Emboss, SourceOverOnlyWithoutAWorkImageAndExtraGetsTheSame) {
    for (int separate : {0, 1}) {
        ReliefCanvas c(12, 12, 10);
        c.FillSquare(3);
        for (size_t i = 0; i < c.DstBytes(); ++i) c.dst.pixels[i] = i % 4 == 3 ? 255 : 128;
        GxBitmap before(c.dst);
        c.Run<GxEmboss, GxEmbossProperty>(Relief(0, 1, 5), separate);
        EXPECT_EQ(SamePixels(before, c.dst), separate == 1);  // the bevel's choice reversed
    }
    ReliefCanvas c(12, 12, 10);
    c.FillSquare(3);
    GxBitmap extra(c.dst.width, c.dst.height, 4);
    c.Run<GxEmboss, GxEmbossProperty>(Relief(0, 1, 5), 1, &extra);
    EXPECT_GT(c.DrawnPixels(), 50);
    EXPECT_TRUE(SamePixels(c.dst, extra));
}

}  // namespace
}  // namespace Glimmer
