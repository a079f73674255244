// The emboss layer: radii and offset, the two local passes and the soft light
// job by hand, exact bytes on a tiny mask, the two-sided style against the
// plain one, and its blend mode and extra target. Properties shared with the
// bevel are in ReliefTest.cpp.

#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "ReliefTestSupport.h"
#include "effect/filters/GxEmboss.h"

namespace Glimmer {
namespace {

using namespace Testing;

TEST(Emboss, RadiusSelectionAndOffset) {
    struct Row { float size; int technique, soften, ro, ri, rs, margin; bool exact; };
    for (Row r : {Row{10, 1, 0, 8, 6, 0, 8, false},     // ceil(5 + 3), ceil(5 + 1)
                  Row{11, 1, 5, 9, 7, 0, 19, false},    // h = 5.5
                  Row{25, 0, 0, 8, 8, 14, 36, false},   // local passes up to 25
                  Row{26, 0, 16, 8, 8, 14, 40, true},   // the exact transform from 26
                  Row{26, 2, 0, 16, 14, 0, 16, false}}) {
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
    for (int y = 0; y < 10; ++y)
        for (int x = 0; x < 10; ++x) EXPECT_EQ(SignedAlpha(c.Pixel(x, y)), expect[y][x]) << x << "," << y;
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
