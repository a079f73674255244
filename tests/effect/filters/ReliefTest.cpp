// The pieces bevel and emboss share (blur, distance transforms, the local
// searches against their literal scans, the row kernels against theirs,
// light, edge factor, plane writes, colouring, plane rotation), then
// properties both layers must have.

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <random>
#include <vector>

#include "effect/filters/GxBevel.h"
#include "effect/filters/GxEmboss.h"
#include "effect/filters/GxRelief.h"
#include "effect/filters/GxReliefRows.h"
#include "effect/filters/GxSqrt.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using namespace Testing;
constexpr float kFar = 1e20f;

TEST(ReliefKernels, BlurByHandAndAgainstTheFormula) {
    // Radius 1: weights 100 and 1, total 102. One 255 pixel: vertical 250 at
    // the centre and 2 above and below; horizontal 245 at the centre, 2 beside,
    // 1 above and below. Nothing outside [1, 4) x [1, 4) is written.
    std::vector<uint8_t> src(25, 0), dst(25, 0xAB);
    src[12] = 255;
    ASSERT_EQ(ReliefBlur(src.data(), dst.data(), 5, 1, 5), 0);
    const std::vector<uint8_t> want = {171, 171, 171, 171, 171, 171, 0, 1, 0, 171, 171, 2, 245,
                                       2,   171, 171, 0,   1,   0,   171, 171, 171, 171, 171, 171};
    EXPECT_EQ(dst, want);

    std::mt19937 rng(7);
    // Dense planes, and wide ones of flat patches (tiles of columns that read
    // one byte throughout are passed over): zeros, and other constants.
    struct Plane { int r, w, h, flat; };
    for (Plane p : {Plane{2, 13, 10, -1}, Plane{5, 19, 16, -1}, Plane{16, 41, 38, -1}, Plane{3, 150, 12, 0},
                    Plane{9, 230, 40, 0}, Plane{0, 99, 9, 77}, Plane{1, 180, 30, 77}, Plane{7, 300, 45, 200}}) {
        const int r = p.r, w = p.w, h = p.h;
        std::vector<uint8_t> in(size_t(w) * h), out(in.size(), 0), ref(in.size(), 0);
        for (auto& v : in) v = uint8_t(rng() % 4 == 0 ? 255 : rng() % 256);
        if (p.flat >= 0) {
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x)
                    if (!(x > w / 3 && x < w / 2 && y % 5 < 2) && (x / 23 + y / 7) % 5 != 0)
                        in[y * w + x] = uint8_t((y / 9) % 2 ? p.flat : 0);  // bands reaching both edges
        }
        ReliefBlur(in.data(), out.data(), w, r, h);
        std::vector<int> wt(r + 1, 100);
        int total = 100;
        for (int i = 1; i <= r; ++i) {
            wt[i] = int(std::exp(float(-(i * i)) / (float(r * r) / 4.60517f)) * 100.0f + 0.5f);
            total += 2 * wt[i];
        }
        for (int y = r; y < h - r; ++y) {
            std::vector<int> row(w, 0);
            for (int x = r; x < w - r; ++x) {
                int acc = 100 * in[y * w + x];
                for (int i = 1; i <= r; ++i) acc += wt[i] * (in[(y - i) * w + x] + in[(y + i) * w + x]);
                row[x] = acc / total;
            }
            for (int x = r; x < w - r; ++x) {
                int acc = 100 * row[x];
                for (int i = 1; i <= r; ++i) acc += wt[i] * (row[x - i] + row[x + i]);
                ref[y * w + x] = uint8_t(std::min(acc / total, 255));
            }
        }
        EXPECT_EQ(out, ref) << "radius " << r;
    }
}

TEST(ReliefKernels, DistanceTransformsAgainstBruteForce) {
    std::mt19937 rng(11);
    const float values[] = {0.0f, kFar, 1.0f, 4.0f, 0.25f, 9.5f, 30.0f};
    for (int n = 1; n <= 12; ++n) {
        for (int trial = 0; trial < 200; ++trial) {
            std::vector<float> f(n), d(n, -1.0f);
            for (float& v : f) v = values[rng() % 7];
            ReliefDT1D(f.data(), d.data(), n);
            for (int p = 0; p < n; ++p) {
                float best = kFar * 4;
                for (int q = 0; q < n; ++q) best = std::min(best, f[q] + float((p - q) * (p - q)));
                ASSERT_EQ(d[p], best) << "n " << n << " p " << p;
            }
        }
    }
    // The fast transform beside the literal one on fields of 0 and kFar as the
    // layers build them: sparse seeds, glyph-like blocks, empty and full lines.
    for (int trial = 0; trial < 24; ++trial) {
        const int w = 1 + int(rng() % 70), h = 1 + int(rng() % 50);
        const unsigned density = 1 + rng() % 6;
        std::vector<float> fast(size_t(w) * h);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                bool zero = trial % 3 == 0 ? rng() % (3 * density) == 0 : ((x / 7 + y / 5) % density == 0);
                if (trial % 4 == 1 && (x % 11 == 3 || y % 9 == 2)) zero = trial % 8 == 1;  // whole lines alike
                fast[size_t(y) * w + x] = (zero != (trial % 2 == 0)) ? 0.0f : kFar;
            }
        std::vector<float> slow = fast, near = fast;
        const int reach = int(rng() % 12);
        ASSERT_TRUE(ReliefExactTransform(fast.data(), w, h));
        ASSERT_TRUE(ReliefExactTransformNear(near.data(), w, h, reach));
        ASSERT_TRUE(ReliefExactTransformReference(slow.data(), w, h));
        ASSERT_EQ(std::memcmp(fast.data(), slow.data(), fast.size() * sizeof(float)), 0) << w << "x" << h;
        const float most = float(reach * reach);
        for (size_t i = 0; i < slow.size(); ++i)
            ASSERT_TRUE(slow[i] <= most ? near[i] == slow[i] : near[i] > most) << w << "x" << h << " at " << i;
    }
    // What the emboss relies on to transform only that far: fsqrt stays within
    // 0.2 % of the root of every squared distance a frame can hold.
    for (int v = 1; v < (1 << 23); v += 1 + v / 4096)
        ASSERT_TRUE(std::fabs(fsqrt(float(v)) - std::sqrt(float(v))) < 0.002f * std::sqrt(float(v))) << v;
    const int w = 17, h = 11;
    std::vector<float> field(w * h);
    for (float& v : field) v = rng() % 9 == 0 ? 0.0f : kFar;
    const std::vector<float> seeds = field;
    ASSERT_TRUE(ReliefExactTransform(field.data(), w, h));
    for (int y = 0; y < h; ++y) {
        for (int x = 0; x < w; ++x) {
            float best = kFar;
            for (int j = 0; j < h; ++j)
                for (int i = 0; i < w; ++i)
                    if (seeds[j * w + i] == 0.0f) best = std::min(best, float((x - i) * (x - i) + (y - j) * (y - j)));
            ASSERT_EQ(field[y * w + x], best) << x << "," << y;
        }
    }
}

TEST(ReliefKernels, SearchesAgreeBitForBitWithTheLiteralScans) {
    std::mt19937 rng(5);
    // Fields shaped like the filters': a flat range, edge fractions, zeros, and
    // by kind of trial: values past the range (which the disc cannot serve),
    // negatives (the outward pass's inside, and the kNonZero fallback), and for
    // the inward pass sources high enough to make new ones.
    enum Trial { kPlain, kWide, kNegative, kHigh };
    auto randomField = [&](int w, int h, float range, Trial trial) {
        std::vector<float> f(size_t(w) * h);
        for (float& v : f) {
            const unsigned r = rng() % 10;
            v = r < 6 ? range : r < 8 ? 1.0f - float(1 + rng() % 254) / 254.99f : r < 9 ? 0.0f : -float(rng() % 4);
            if (trial == kWide && rng() % 5 == 0) v = range + 0.5f + float(rng() % 4);
            if (trial == kPlain && v < 0.0f) v = 0.0f;
            if (v == range && trial != kHigh) v = 1.0f + float(rng() % 1000) / 1000.0f;  // inward sources at most 2
        }
        return f;
    };
    struct Case { int w, h, radius, y0, y1; };
    for (Case c : {Case{9, 7, 3, 0, 7}, Case{20, 13, 5, 4, 9}, Case{31, 5, 12, 1, 5}, Case{6, 6, 40, 0, 6},
                   Case{16, 16, 0, 0, 16}, Case{40, 30, 9, 10, 11}, Case{84, 30, 78, 0, 30},  // disc past the table
                   Case{140, 8, 130, 0, 8}}) {                                                 // nearest-first
        for (Trial trial : {kPlain, kWide, kNegative, kHigh}) {
            const std::vector<float> field = randomField(c.w, c.h, float(c.radius), trial);
            for (GxReliefTargets t : {GxReliefTargets::kNonZero, GxReliefTargets::kPositive}) {
                std::vector<float> fast = field, slow = field;
                ReliefLocalDistance(fast.data(), c.w, c.h, c.radius, c.y0, c.y1, t);
                ReliefLocalDistanceReference(slow.data(), c.w, c.h, c.radius, c.y0, c.y1, t);
                ASSERT_EQ(std::memcmp(fast.data(), slow.data(), fast.size() * sizeof(float)), 0)
                    << c.w << "x" << c.h << " r" << c.radius << " trial " << trial;
            }
            std::vector<float> fast = field, slow = field;
            ReliefInwardDistance(fast.data(), c.w, c.h, c.radius, c.y0, c.y1);
            ReliefInwardDistanceReference(slow.data(), c.w, c.h, c.radius, c.y0, c.y1);
            ASSERT_EQ(std::memcmp(fast.data(), slow.data(), fast.size() * sizeof(float)), 0)
                << "inward " << c.w << "x" << c.h << " r" << c.radius << " trial " << trial;
        }
    }
    // An inward improvement above 1.0 is a source for the pixels after it:
    // the 8 is out of the last pixel's window, the new 7 is not.
    std::vector<float> line = {8.0f, -5.0f, -5.0f};
    ReliefInwardDistance(line.data(), 3, 1, 1, 0, 1);
    EXPECT_EQ(line, (std::vector<float>{8.0f, 7.0f, 6.0f}));
    // One source in a 60 x 60 corner: the far corner is at index 6962, past
    // the root table's 5490 entries, and gets sqrt(6962) to three places.
    std::vector<float> fast(3600, 100.0f);
    fast[0] = 0.0f;
    std::vector<float> slow = fast;
    ReliefLocalDistance(fast.data(), 60, 60, 60, 0, 60, GxReliefTargets::kNonZero);
    ReliefLocalDistanceReference(slow.data(), 60, 60, 60, 0, 60, GxReliefTargets::kNonZero);
    EXPECT_EQ(fast, slow);
    EXPECT_EQ(fast[3599], 83.439f);
    GxReliefRoots roots(2 * 130 * 130);
    for (int i = 0; i < 2 * 130 * 130; i += 13) ASSERT_EQ(roots[i], IntSqrt(i)) << i;
}

// Every compiled row kernel beside its reference: random rows of every width
// from 1 to 64 and some long ones, outputs poisoned with random bytes first.
TEST(ReliefKernels, EveryRowKernelGivesTheReferenceBits) {
    std::mt19937 rng(13);
    const auto variants = ReliefRows::Variants();
    ASSERT_FALSE(variants.empty());
    const ReliefRows::Table& reference = ReliefRows::ReferenceTable();
    std::vector<int> widths;
    for (int n = 1; n <= 64; ++n) widths.push_back(n);
    widths.insert(widths.end(), {200, 1031});
    auto bytes = [&](size_t n) {
        std::vector<uint8_t> v(n);
        for (auto& b : v) b = uint8_t(rng());
        return v;
    };
    // Heights as the layers make them: the range itself (flat), steps of
    // roots and fractions, zeros, negatives, and the odd value far off.
    auto heights = [&](size_t n, float range) {
        std::vector<float> v(n);
        for (float& f : v) {
            const unsigned k = rng() % 8;
            f = k < 2 ? range : k < 3 ? 0.0f : k < 6 ? float(int(rng() % 2000) - 600) / 97.0f
                : k < 7 ? IntSqrt(int(rng() % 300)) : (rng() % 2 ? 1e20f : -3.5f);
        }
        return v;
    };
    auto same = [](const auto& a, const auto& b) {
        return a.size() == b.size() && std::memcmp(a.data(), b.data(), a.size() * sizeof(a[0])) == 0;
    };

    for (int n : widths) {
        const size_t stride = size_t(n) + 2;
        ReliefRows::Light light;
        const GxReliefLight l = ReliefLightVector(float(rng() % 720) - 180.0f, float(rng() % 90), int(rng() % 2));
        light.x = l.x, light.y = l.y, light.z = l.z;
        light.normalZ = ReliefNormalZ(float(rng() % 300) / 20.0f, 0.1f);
        light.range = float(1 + rng() % 12);
        light.inRange = float(1 + rng() % 12);
        light.secondAlpha = int(rng() % 256);
        light.firstAlpha = int(rng() % 256);
        light.inside = rng() % 2;
        const std::vector<float> outer = heights(3 * stride, light.range);
        const std::vector<float> inner = heights(3 * stride, light.inRange);
        const float* o = outer.data() + stride + 1;
        const float* in = inner.data() + stride + 1;
        const std::vector<uint8_t> second = bytes(size_t(n)), first = bytes(size_t(n));

        std::vector<uint8_t> want[3][2];
        for (int k = 0; k < 3; ++k) want[k][0] = second, want[k][1] = first;
        reference.bevelLight(o, ptrdiff_t(stride), n, light, want[0][0].data(), want[0][1].data());
        reference.embossHardLight(o, ptrdiff_t(stride), n, light, want[1][0].data(), want[1][1].data());
        reference.embossSoftLight(o, in, ptrdiff_t(stride), n, light, want[2][0].data(), want[2][1].data());

        // A disc of radius r swept from a source near the row's middle or ends.
        const int r = 1 + int(rng() % 9);
        std::vector<int> chords(size_t(r) + 1);
        std::vector<std::vector<float>> discRows(size_t(r) + 1);
        std::vector<const float*> discRoots(size_t(r) + 1);
        for (int a = 0; a <= r; ++a) {
            chords[a] = int(std::sqrt(float(r * r - a * a)));
            for (int dx = -chords[a]; dx <= chords[a]; ++dx) discRows[a].push_back(IntSqrt(a * a + dx * dx));
            discRoots[a] = discRows[a].data() + chords[a];
        }
        const ReliefRows::Disc disc{chords.data(), discRoots.data()};
        const int rows = 2 * r + 1;
        const std::vector<float> swept = heights(size_t(n) * rows, float(r));
        const int sourceX = int(rng() % 3) == 0 ? 0 : int(rng() % n);
        const int left = int(rng() % (r + 2)), right = rng() % 4 == 0 ? 0 : r;
        const float amount = float(rng() % 100) / 101.0f;
        std::vector<float> wantSwept = swept;
        reference.sweepSource(wantSwept.data(), n, n, sourceX, r, 0, rows, left, right, disc, amount);

        const std::vector<float> sideRows = heights(3 * size_t(n), 1.5f);
        const bool positive = rng() % 2;
        std::vector<uint8_t> wantSides = bytes(size_t(n));
        const std::vector<uint8_t> sidesPoison = wantSides;
        reference.sweepSides(sideRows.data(), sideRows.data() + n, sideRows.data() + 2 * n, n, positive,
                             wantSides.data());

        // A row of squared column distances and far entries, within a reach.
        const int reach = int(rng() % 13);
        std::vector<float> squares(size_t(n) + 2 * size_t(reach));
        for (float& v : squares) v = rng() % 5 == 0 ? 1e20f : float((rng() % 40) * (rng() % 40));
        std::vector<float> wantNear(size_t(n), 7.0f);
        reference.nearRow(squares.data() + reach, reach, n, wantNear.data());

        // The inward row: a padded plane of sources (values above 1 or -inf).
        const int ir = int(rng() % 5);
        const size_t plane = size_t(n) + 2 * size_t(ir);
        std::vector<float> sources = heights(plane * (2 * size_t(ir) + 1), 3.0f);
        for (float& v : sources) v = v > 1.0f ? v : -INFINITY;
        std::vector<float> windowRoots;
        for (int a = -ir; a <= ir; ++a)
            for (int dx = -ir; dx <= ir; ++dx) windowRoots.push_back(IntSqrt(a * a + dx * dx));
        const std::vector<float> cur = heights(size_t(n), -2.0f);
        const float* centre = sources.data() + size_t(ir) * plane + size_t(ir);
        std::vector<float> wantInward(size_t(n), 7.0f);
        reference.inwardRow(centre, ptrdiff_t(plane), ir, ir, ir, windowRoots.data(), cur.data(), wantInward.data(), n);

        const float gain = std::array<float, 3>{1.0f, 1.83f, 2.03f}[rng() % 3];
        const uint32_t firstColour = rng(), secondColour = rng();
        std::vector<uint32_t> wantWords(size_t(n), 0xDEADBEEFu);
        reference.colourise(first.data(), second.data(), n, gain, firstColour, secondColour, wantWords.data());
        const std::vector<uint8_t> mirroredFirst = bytes(size_t(n)), mirroredSecond = bytes(size_t(n));
        std::vector<uint8_t> coverage = bytes(size_t(n));
        for (size_t i = 0; i < coverage.size(); i += 3) coverage[i] = i % 2 ? 255 : 0;  // the two shortcuts
        std::vector<uint32_t> wantTwoSided(size_t(n), 0xDEADBEEFu);
        reference.twoSided(first.data(), second.data(), mirroredFirst.data(), mirroredSecond.data(), coverage.data(),
                           n, gain, firstColour, secondColour, wantTwoSided.data());

        for (const auto& v : variants) {
            std::vector<uint8_t> got[3][2];
            for (int k = 0; k < 3; ++k) got[k][0] = second, got[k][1] = first;
            v.table->bevelLight(o, ptrdiff_t(stride), n, light, got[0][0].data(), got[0][1].data());
            v.table->embossHardLight(o, ptrdiff_t(stride), n, light, got[1][0].data(), got[1][1].data());
            v.table->embossSoftLight(o, in, ptrdiff_t(stride), n, light, got[2][0].data(), got[2][1].data());
            for (int k = 0; k < 3; ++k)
                ASSERT_TRUE(same(got[k][0], want[k][0]) && same(got[k][1], want[k][1]))
                    << v.name << " light " << k << " width " << n;
            std::vector<float> gotSwept = swept;
            v.table->sweepSource(gotSwept.data(), n, n, sourceX, r, 0, rows, left, right, disc, amount);
            ASSERT_TRUE(same(gotSwept, wantSwept)) << v.name << " sweep width " << n;
            std::vector<uint8_t> gotSides = sidesPoison;
            v.table->sweepSides(sideRows.data(), sideRows.data() + n, sideRows.data() + 2 * n, n, positive,
                                gotSides.data());
            ASSERT_TRUE(same(gotSides, wantSides)) << v.name << " sides width " << n;
            std::vector<float> gotNear(size_t(n), 7.0f);
            v.table->nearRow(squares.data() + reach, reach, n, gotNear.data());
            ASSERT_TRUE(same(gotNear, wantNear)) << v.name << " near width " << n;
            std::vector<float> gotInward(size_t(n), 7.0f);
            v.table->inwardRow(centre, ptrdiff_t(plane), ir, ir, ir, windowRoots.data(), cur.data(), gotInward.data(), n);
            ASSERT_TRUE(same(gotInward, wantInward)) << v.name << " inward width " << n;
            std::vector<uint32_t> gotWords(size_t(n), 0xDEADBEEFu);
            v.table->colourise(first.data(), second.data(), n, gain, firstColour, secondColour, gotWords.data());
            ASSERT_TRUE(same(gotWords, wantWords)) << v.name << " colours width " << n;
            std::vector<uint32_t> gotTwoSided(size_t(n), 0xDEADBEEFu);
            v.table->twoSided(first.data(), second.data(), mirroredFirst.data(), mirroredSecond.data(),
                              coverage.data(), n, gain, firstColour, secondColour, gotTwoSided.data());
            ASSERT_TRUE(same(gotTwoSided, wantTwoSided)) << v.name << " two-sided width " << n;
        }
    }
}

TEST(ReliefKernels, LightVectorForAngleAndAltitudePairs) {
    GxReliefLight l = ReliefLightVector(180.0f, 0.0f, 1);  // t = a = 0: along +x
    EXPECT_TRUE(l.x == 1.0f && l.y == 0.0f && l.z == 0.0f);
    l = ReliefLightVector(180.0f, 0.0f, 0);  // direction 0 negates x and y only
    EXPECT_TRUE(l.x == -1.0f && l.z == 0.0f);
    l = ReliefLightVector(0.0f, 0.0f, 1);  // t = 3.14159, short of pi: y keeps a rest
    EXPECT_EQ(l.x, -1.0f);
    EXPECT_TRUE(l.y > 2e-6f && l.y < 3e-6f);
    l = ReliefLightVector(135.0f, 30.0f, 0);
    EXPECT_NEAR(l.x, -0.70711f * 0.86603f, 1e-4f);
    EXPECT_NEAR(l.y, -0.70711f * 0.86603f, 1e-4f);
    EXPECT_NEAR(l.z, 0.5f, 1e-5f);
    EXPECT_EQ(ReliefNormalZ(0.0f, kBevelVariant.depthFloor), 2.4f / 0.1f);
    EXPECT_EQ(ReliefNormalZ(0.0f, kEmbossVariant.depthFloor), 2.4f / 0.2f);
}

TEST(ReliefKernels, LevelEdgeFactorPlaneWriteAndColouring) {
    EXPECT_EQ(ReliefClampLevel(300.0f), 255.0f);
    EXPECT_EQ(ReliefClampLevel(NAN), 0.0f);
    EXPECT_EQ(ReliefEdgeFactor(0.5f), 128);  // 127.5 + 0.5
    EXPECT_EQ(ReliefEdgeFactor(1.0f), 255);  // 255.5 capped
    EXPECT_EQ(ReliefEdgeFactor(-2.0f), 0);
    EXPECT_EQ(ReliefEdgeFactor(NAN), 0);
    EXPECT_EQ(ReliefPlaneValue(0, 255), 0);            // (0 + 1) * 255 >> 8
    EXPECT_EQ(ReliefPlaneValue(255 * 53, 128), 26);    // (52 + 1) * 128 >> 8
    EXPECT_EQ(ReliefPlaneValue(256 * 257, 255), 255);  // 258 * 255 reaches 65536
    EXPECT_EQ(ReliefPlaneValue(-4096, 255), 0);

    // The stronger wash after the gain (truncated) wins; a tie takes the
    // second colour, at alpha 0.
    EXPECT_FALSE(ReliefTone(10, 10, 1.83f).first);
    const uint8_t first[] = {200, 0, 1, 3};
    const uint8_t second[] = {0, 100, 1, 2};
    uint32_t out[4];
    ReliefColourise(first, second, 4, 1.83f, 0xFF336699, 0x00FFFFFF, out);
    EXPECT_EQ(out[0], 0xFF336699u);  // 366 capped at 255: the colour as it is
    EXPECT_EQ(out[1], 0xB7B7B7B7u);  // 183 in the second colour; its own alpha is not read
    EXPECT_EQ(out[2], 0u);           // tie
    EXPECT_EQ(out[3], 0x02000001u);  // int(5.49) - int(3.66) = 2: blue (153 + 1) * 2 >> 8
}

TEST(ReliefKernels, BlursRotateThePlanesAndKeepOuterStrips) {
    // 7 x 7 planes, second all 30, first all 90, radius 1 blurs: the outer
    // ring is never written, so it shows which buffer went where.
    auto ringOf = [](const uint8_t* p) {
        std::vector<uint8_t> r;
        for (int i = 0; i < 7; ++i) r.insert(r.end(), {p[i], p[42 + i], p[i * 7], p[i * 7 + 6]});
        return std::all_of(r.begin(), r.end(), [&](uint8_t v) { return v == r[0]; }) ? int(r[0]) : -1;
    };
    // Smoothing with radius 0 (a smooth relief of a negative size) copies, but
    // still rotates the buffers, so the softened ring differs from no smoothing.
    struct Case { bool smooth; int radius, soften, secondRing, firstRing; };
    for (Case c : {Case{true, 1, 0, 0, 30}, Case{true, 1, 1, 90, 0}, Case{false, 0, 1, 0, 30},
                   Case{true, 0, 1, 90, 30}}) {
        GxReliefPlanes p;
        ASSERT_TRUE(p.Allocate(49));
        std::memset(p.second, 30, 49);
        std::memset(p.first, 90, 49);
        ASSERT_TRUE(ReliefSmoothAndSoften(&p, 7, 7, c.smooth, c.radius, c.soften));
        EXPECT_EQ(ringOf(p.second), c.secondRing) << c.smooth << c.radius << c.soften;
        EXPECT_EQ(ringOf(p.first), c.firstRing) << c.smooth << c.radius << c.soften;
    }
    GxReliefPlanes p;
    ASSERT_TRUE(p.Allocate(49));
    EXPECT_FALSE(ReliefSmoothAndSoften(&p, 7, 7, true, -1, 0));  // would blur outside the planes
}

TEST(ReliefKernels, FramesAndSizes) {
    GxReliefFrame f;
    ASSERT_TRUE(ReliefPlanFrame(GxRect(10, 20, 10, 20), 4, &f));  // empty text: 2M x 2M
    EXPECT_TRUE(f.width == 8 && f.height == 8 && f.x0 == 6 && f.y0 == 16);
    EXPECT_FALSE(ReliefPlanFrame(GxRect(0, 0, 100, 100), 40000, &f));
    int r = -1;
    EXPECT_TRUE(ReliefSizePixels(-3.7f, &r) && r == -3);  // toward zero, no clamp
    EXPECT_TRUE(ReliefSizePixels(NAN, &r) && r == 0);
    EXPECT_FALSE(ReliefSizePixels(-1025.0f, &r));
    EXPECT_TRUE(ReliefSizePixels(14.9f, &r) && r == 14);
    EXPECT_TRUE(ReliefSizePixels(1024.9f, &r) && r == 1024);
    EXPECT_FALSE(ReliefSizePixels(1025.0f, &r));  // the filters' radius limit
    EXPECT_FALSE(ReliefSizePixels(1e30f, &r));
}

// ---- properties of both layers

struct BevelKind {
    using Layer = GxBevel;
    using Record = GxBevelProperty;
    static int Margin(const ReliefParams& p) { return GxBevel::geometry(MakeRecord<Record>(p)).margin; }
    // Outside this many pixels from the edge the field is flat. The bevel has
    // one flat side: the ground of an outer bevel, the top of an inner one.
    static int Reach(const ReliefParams& p) {
        const GxBevelGeometry g = GxBevel::geometry(MakeRecord<Record>(p));
        return g.range + g.smoothRadius + g.soften + 1;
    }
    static bool FlatOutside(const ReliefParams& p) { return p.style != 1; }
    static bool FlatInside(const ReliefParams& p) { return p.style == 1; }
    static std::vector<ReliefParams> Cases() {
        return {Relief(1, 0, 3), Relief(0, 1, 6, 4), Relief(1, 0, 15), Relief(0, 0, 15, 4)};
    }
    static ReliefParams Largest() { return Relief(0, 1, 120, 16); }  // windows to 2 * 122^2
};

struct EmbossKind {
    using Layer = GxEmboss;
    using Record = GxEmbossProperty;
    static int Margin(const ReliefParams& p) { return GxEmboss::geometry(MakeRecord<Record>(p)).margin; }
    static int Reach(const ReliefParams& p) {
        const GxEmbossGeometry g = GxEmboss::geometry(MakeRecord<Record>(p));
        return g.outRange + g.smoothRadius + g.soften + 1;
    }
    static bool FlatOutside(const ReliefParams&) { return true; }
    static bool FlatInside(const ReliefParams&) { return true; }
    static std::vector<ReliefParams> Cases() {
        return {Relief(0, 1, 6), Relief(1, 1, 12, 3), Relief(0, 0, 9, 2), Relief(0, 0, 26, 4)};
    }
    static ReliefParams Largest() { return Relief(0, 1, 130, 16); }  // windows to 2 * 68^2
};

template <typename Kind>
class ReliefLayer : public ::testing::Test {
protected:
    using Layer = typename Kind::Layer;
    using Record = typename Kind::Record;
    static void Run(ReliefCanvas& c, const ReliefParams& p, int separate = 0, GxBitmap* extra = nullptr) {
        c.template Run<Layer, Record>(p, separate, extra);
    }
};
using ReliefKinds = ::testing::Types<BevelKind, EmbossKind>;
TYPED_TEST_SUITE(ReliefLayer, ReliefKinds);

// Direction 0 negates the horizontal light: on a mask symmetric under a half
// turn the picture turns half round, byte for byte, so the colours swap sides.
TYPED_TEST(ReliefLayer, DirectionZeroTurnsThePictureHalfRound) {
    std::vector<ReliefParams> cases = TypeParam::Cases();
    cases.push_back(TypeParam::Largest());  // past the root table: proves the reads under ASan
    for (ReliefParams p : cases) {
        const bool largest = p.size > 100;
        ReliefCanvas up(largest ? 5 : 15, largest ? 5 : 13, TypeParam::Margin(p) + 1);
        up.FillPointSymmetric(5 + p.soften);
        ReliefCanvas down = up;
        this->Run(up, p);
        p.direction = 0;
        this->Run(down, p);
        EXPECT_GT(up.DrawnPixels(), largest ? 1000 : 50);
        EXPECT_TRUE(HalfTurnOf(up.dst, down.dst)) << "style " << p.style << " size " << p.size;
    }
}

TYPED_TEST(ReliefLayer, TransparentColoursDrawNothingAndOneShowsOnlyTheOther) {
    std::mt19937 rng(9);
    for (ReliefParams p : TypeParam::Cases()) {
        p.first &= 0x00FFFFFF;
        p.second &= 0x00FFFFFF;
        for (int separate : {0, 1}) {
            ReliefCanvas c(10, 8, TypeParam::Margin(p));
            c.FillPointSymmetric(3);
            for (size_t i = 0; i < c.DstBytes(); ++i) c.dst.pixels[i] = uint8_t(rng());
            GxBitmap before(c.dst), extra(c.dst);
            this->Run(c, p, separate, &extra);
            EXPECT_TRUE(SamePixels(before, c.dst) && SamePixels(before, extra)) << p.size << separate;
        }
    }
    // Each plane is scaled by its own colour's alpha.
    for (bool firstTransparent : {true, false}) {
        ReliefParams p = TypeParam::Cases()[1];
        (firstTransparent ? p.first : p.second) &= 0x00FFFFFF;
        ReliefCanvas c(10, 10, TypeParam::Margin(p));
        c.FillSquare(2);
        this->Run(c, p);
        int red = 0, blue = 0;
        for (size_t i = 0; i < c.DstBytes(); i += 4) {
            red += c.dst.pixels[i] != 0;
            blue += c.dst.pixels[i + 2] != 0;
        }
        EXPECT_EQ(red == 0, firstTransparent);
        EXPECT_EQ(blue == 0, !firstTransparent);
        EXPECT_GT(red + blue, 20);
    }
}

TYPED_TEST(ReliefLayer, FlatRegionsProduceNothing) {
    for (ReliefParams p : TypeParam::Cases()) {
        const int reach = TypeParam::Reach(p);
        ReliefCanvas c(2 * reach + 20, 2 * reach + 20, TypeParam::Margin(p) + 2);
        c.FillSquare(4);
        this->Run(c, p);
        const int lo = c.rect.left + 4, hi = c.rect.right - 4;  // full coverage on [lo, hi)
        int flatSeen = 0, flatDrawn = 0;
        for (int y = 0; y < int(c.dst.height); ++y) {
            for (int x = 0; x < int(c.dst.width); ++x) {
                const int out = std::max({lo - x, x - hi + 1, lo - y, y - hi + 1});
                const bool flat = (out > reach && TypeParam::FlatOutside(p)) ||
                                  (-out > reach && TypeParam::FlatInside(p));
                flatSeen += flat;
                flatDrawn += flat && c.Pixel(x, y)[3] != 0;
            }
        }
        EXPECT_GT(c.DrawnPixels(), 100);
        EXPECT_GE(flatSeen, 100);
        EXPECT_EQ(flatDrawn, 0) << "style " << p.style << " size " << p.size;
    }
}

TYPED_TEST(ReliefLayer, MissingAndExtremeInputIsClean) {
    ReliefCanvas c(6, 5, 3);
    c.FillSquare(1);
    typename TypeParam::Layer bare;
    GxECore::ParamPostProcessing pp{&c.dst, &c.mask, &c.rect, 0, nullptr};
    bare.doPostProcessing(&pp);  // no property
    EXPECT_EQ(bare.getOffset(), 0);
    typename TypeParam::Record record = MakeRecord<typename TypeParam::Record>(TypeParam::Cases()[0]);
    bare.setProperty(&record);
    bare.doPostProcessing(nullptr);
    pp.src = nullptr;
    bare.doPostProcessing(&pp);
    EXPECT_EQ(c.DrawnPixels(), 0);

    for (ReliefParams p : TypeParam::Cases()) {
        ReliefCanvas edge(8, 8, 0);  // text against every canvas edge (the exact
        edge.FillSquare(0);          // transform reads one column and row further)
        this->Run(edge, p);
        EXPECT_GT(edge.DrawnPixels(), 0);
        ReliefCanvas empty(0, 0, TypeParam::Margin(p));  // a 2M x 2M frame
        this->Run(empty, p);
    }
    for (float size : {1e9f, INFINITY, NAN, -50.0f}) {
        ReliefParams p = Relief(0, 1, size);
        ReliefCanvas t(6, 5, 3);
        t.FillSquare(1);
        this->Run(t, p);
        // NaN acts as 0; -50 gives a frame smaller than the text and draws nothing.
        EXPECT_EQ(t.DrawnPixels() > 0, size != size) << size;
        typename TypeParam::Record huge = MakeRecord<typename TypeParam::Record>(p);
        bare.setProperty(&huge);
        if (size == size) {
            EXPECT_EQ(bare.getOffset(), 0) << size;  // no margin either
        }
    }
}

}  // namespace
}  // namespace Glimmer
