// Bevel and emboss: the kernels they share against their literal references
// (blur, distance transforms, local searches, row kernels), the layers'
// radii, margins and refusals, and their blend modes. Their pixels are pinned
// by the picture table.

#include <gtest/gtest.h>

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

using Testing::RunLayer;
using Testing::SamePixels;
constexpr float kFar = 1e20f;

struct ReliefParams {
    int style, technique;
    float size;
    int soften;
};

ReliefParams Relief(int style, int technique, float size, int soften = 0) { return {style, technique, size, soften}; }

// Depth 1, light from 120 degrees at 30, opaque blue highlights and red shades.
template <typename Record>
Record MakeRecord(const ReliefParams& p) {
    return Record(p.style, 1.0f, p.size, 1, p.technique, p.soften, 1.0f, 120.0f, 30.0f, 0xFF0000FF, 1.0f,
                  0xFFFF0000, 1.0f);
}

// A mask and a 32-bit target of the same size, with the text rectangle
// `pad` pixels in from every side.
struct ReliefCanvas {
    ReliefCanvas(int textWidth, int textHeight, int pad)
        : mask(textWidth + 2 * pad, textHeight + 2 * pad, 1), dst(textWidth + 2 * pad, textHeight + 2 * pad, 4),
          rect(pad, pad, pad + textWidth, pad + textHeight) {}

    template <typename Layer, typename Record>
    void Run(const ReliefParams& p, int separateWorkImage = 0, GxBitmap* extra = nullptr) {
        Record record = MakeRecord<Record>(p);
        Layer layer;
        layer.setProperty(&record);
        RunLayer(layer, mask, dst, rect, separateWorkImage, extra);
    }
    uint8_t& Mask(int x, int y) { return mask.pixels[size_t(y) * mask.width + size_t(x)]; }
    int DrawnPixels() const {
        int n = 0;
        for (size_t i = 3; i < size_t(dst.width) * dst.height * 4; i += 4) n += dst.pixels[i] != 0;
        return n;
    }
    // Full coverage `inset` pixels in from the text rectangle's sides, with a
    // one-pixel rim of 128.
    void FillSquare(int inset) {
        for (int y = rect.top + inset - 1; y < rect.bottom - inset + 1; ++y)
            for (int x = rect.left + inset - 1; x < rect.right - inset + 1; ++x)
                if (x >= 0 && y >= 0 && x < int(mask.width) && y < int(mask.height))
                    Mask(x, y) = x < rect.left + inset || y < rect.top + inset || x >= rect.right - inset ||
                                         y >= rect.bottom - inset ? 128 : 255;
    }
    GxBitmap mask, dst;
    GxRect rect;
};

// ---- the shared kernels against their literal references

TEST(ReliefKernels, BlurAgainstTheFormula) {
    std::mt19937 rng(7);
    // Dense planes, and wide ones of flat patches (tiles of columns that read
    // one byte throughout are passed over): zeros, and other constants. The
    // outputs start poisoned: nothing outside [r, w - r) x [r, h - r) is written.
    struct Plane { int r, w, h, flat; };
    for (Plane p : {Plane{2, 13, 10, -1}, Plane{5, 19, 16, -1}, Plane{16, 41, 38, -1}, Plane{3, 150, 12, 0},
                    Plane{9, 230, 40, 0}, Plane{0, 99, 9, 77}, Plane{1, 180, 30, 77}, Plane{7, 300, 45, 200}}) {
        const int r = p.r, w = p.w, h = p.h;
        std::vector<uint8_t> in(size_t(w) * h), out(in.size(), 0xAB), ref(in.size(), 0xAB);
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
        EXPECT_EQ(out, ref) << "the blur differs from the formula at radius " << r;
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
    // Roots past the table's 5490 entries are what a longer table would hold.
    GxReliefRoots roots(2 * 130 * 130);
    for (int i = 0; i < 2 * 130 * 130; i += 13) ASSERT_EQ(roots[i], IntSqrt(i)) << i;
}

// Every compiled row kernel beside its reference: random rows of every width
// from 1 to 64 and some long ones, outputs poisoned with random bytes first.
TEST(ReliefKernels, EveryRowKernelGivesTheReferenceBits) {
    std::mt19937 rng(13);
    const auto variants = ReliefRows::Variants();
    ASSERT_FALSE(variants.empty());
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
    struct Outputs {
        std::vector<uint8_t> light[3][2], sides;
        std::vector<float> swept, nearRow, inward;
        std::vector<uint32_t> words, twoSided;
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
        const std::vector<float> outer = heights(3 * stride, light.range), inner = heights(3 * stride, light.inRange);
        const float* o = outer.data() + stride + 1;
        const float* in = inner.data() + stride + 1;
        const std::vector<uint8_t> second = bytes(size_t(n)), first = bytes(size_t(n));
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
        const std::vector<float> sideRows = heights(3 * size_t(n), 1.5f);
        const bool positive = rng() % 2;
        const std::vector<uint8_t> sidesPoison = bytes(size_t(n));
        // A row of squared column distances and far entries, within a reach.
        const int reach = int(rng() % 13);
        std::vector<float> squares(size_t(n) + 2 * size_t(reach));
        for (float& v : squares) v = rng() % 5 == 0 ? 1e20f : float((rng() % 40) * (rng() % 40));
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
        const float gain = std::array<float, 3>{1.0f, 1.83f, 2.03f}[rng() % 3];
        const uint32_t firstColour = rng(), secondColour = rng();
        const std::vector<uint8_t> mirroredFirst = bytes(size_t(n)), mirroredSecond = bytes(size_t(n));
        std::vector<uint8_t> coverage = bytes(size_t(n));
        for (size_t i = 0; i < coverage.size(); i += 3) coverage[i] = i % 2 ? 255 : 0;  // the two shortcuts

        auto run = [&](const ReliefRows::Table& t) {
            Outputs out;
            for (auto& planes : out.light) planes[0] = second, planes[1] = first;
            t.bevelLight(o, ptrdiff_t(stride), n, light, out.light[0][0].data(), out.light[0][1].data());
            t.embossHardLight(o, ptrdiff_t(stride), n, light, out.light[1][0].data(), out.light[1][1].data());
            t.embossSoftLight(o, in, ptrdiff_t(stride), n, light, out.light[2][0].data(), out.light[2][1].data());
            out.swept = swept;
            t.sweepSource(out.swept.data(), n, n, sourceX, r, 0, rows, left, right, disc, amount);
            out.sides = sidesPoison;
            t.sweepSides(sideRows.data(), sideRows.data() + n, sideRows.data() + 2 * n, n, positive, out.sides.data());
            out.nearRow.assign(size_t(n), 7.0f);
            t.nearRow(squares.data() + reach, reach, n, out.nearRow.data());
            out.inward.assign(size_t(n), 7.0f);
            t.inwardRow(centre, ptrdiff_t(plane), ir, ir, ir, windowRoots.data(), cur.data(), out.inward.data(), n);
            out.words.assign(size_t(n), 0xDEADBEEFu);
            t.colourise(first.data(), second.data(), n, gain, firstColour, secondColour, out.words.data());
            out.twoSided.assign(size_t(n), 0xDEADBEEFu);
            t.twoSided(first.data(), second.data(), mirroredFirst.data(), mirroredSecond.data(), coverage.data(), n,
                       gain, firstColour, secondColour, out.twoSided.data());
            return out;
        };
        const Outputs want = run(ReliefRows::ReferenceTable());
        for (const auto& v : variants) {
            const Outputs got = run(*v.table);
            for (int k = 0; k < 3; ++k)
                ASSERT_TRUE(same(got.light[k][0], want.light[k][0]) && same(got.light[k][1], want.light[k][1]))
                    << v.name << " light kernel " << k << " differs from the reference at width " << n;
            ASSERT_TRUE(same(got.swept, want.swept)) << v.name << " sweepSource differs at width " << n;
            ASSERT_TRUE(same(got.sides, want.sides)) << v.name << " sweepSides differs at width " << n;
            ASSERT_TRUE(same(got.nearRow, want.nearRow)) << v.name << " nearRow differs at width " << n;
            ASSERT_TRUE(same(got.inward, want.inward)) << v.name << " inwardRow differs at width " << n;
            ASSERT_TRUE(same(got.words, want.words)) << v.name << " colourise differs at width " << n;
            ASSERT_TRUE(same(got.twoSided, want.twoSided)) << v.name << " twoSided differs at width " << n;
        }
    }
}

TEST(ReliefKernels, RefusalsAndSafeValues) {
    GxReliefFrame f;
    ASSERT_TRUE(ReliefPlanFrame(GxRect(10, 20, 10, 20), 4, &f));  // empty text: 2M x 2M
    EXPECT_TRUE(f.width == 8 && f.x0 == 6 && f.y0 == 16);
    EXPECT_FALSE(ReliefPlanFrame(GxRect(0, 0, 100, 100), 40000, &f)) << "a frame past the size limit was planned";
    int r = -1;
    EXPECT_TRUE(ReliefSizePixels(NAN, &r) && r == 0);
    EXPECT_TRUE(ReliefSizePixels(1024.9f, &r) && r == 1024) << "1024 is the largest radius allowed";
    for (float refused : {-1025.0f, 1025.0f, 1e30f}) EXPECT_FALSE(ReliefSizePixels(refused, &r)) << refused;
    GxReliefPlanes planes;
    ASSERT_TRUE(planes.Allocate(49));
    EXPECT_FALSE(ReliefSmoothAndSoften(&planes, 7, 7, true, -1, 0)) << "would blur outside the planes";
    EXPECT_EQ(ReliefPlaneValue(256 * 257, 255), 255) << "258 * 255 reaches 65536 and must cap";
}

// ---- what both layers must do

// Each layer draws source-over in one mode and destination-over in the
// other; only the emboss draws into the extra target too. Then missing and
// extreme input: nothing drawn, no margin kept, nothing read out of bounds.
template <typename Layer, typename Record>
void ExpectModesAndCleanRefusals(const GxReliefVariant& variant, std::vector<ReliefParams> cases) {
    for (int separate : {0, 1}) {
        ReliefCanvas c(12, 12, 14);
        c.FillSquare(3);
        for (size_t i = 0; i < size_t(c.dst.width) * c.dst.height * 4; ++i) c.dst.pixels[i] = i % 4 == 3 ? 255 : 128;
        GxBitmap before(c.dst), extra(c.dst.width, c.dst.height, 4), empty(extra);
        c.Run<Layer, Record>(Relief(0, 1, 5), separate, separate ? &extra : nullptr);
        const int mode = separate ? variant.modeWithWorkImage : variant.modeWithoutWorkImage;
        // Destination-over onto an opaque target changes nothing; source-over does.
        EXPECT_EQ(SamePixels(before, c.dst), mode == 2) << "wrong blend mode, work image " << separate;
        EXPECT_EQ(SamePixels(extra, empty), !(variant.drawsExtra && separate)) << "extra, work image " << separate;
    }
    ReliefCanvas c(6, 5, 3);
    c.FillSquare(1);
    Layer bare;
    GxECore::ParamPostProcessing pp{&c.dst, &c.mask, &c.rect, 0, nullptr};
    bare.doPostProcessing(&pp);  // no property
    Record record = MakeRecord<Record>(cases[0]);
    bare.setProperty(&record);
    bare.doPostProcessing(nullptr);
    pp.src = nullptr;
    bare.doPostProcessing(&pp);
    EXPECT_EQ(c.DrawnPixels(), 0) << "drew without a record or a mask";
    for (ReliefParams p : cases) {
        ReliefCanvas edge(8, 8, 0);  // text against every canvas edge (the exact
        edge.FillSquare(0);          // transform reads one column and row further)
        edge.Run<Layer, Record>(p);
        EXPECT_GT(edge.DrawnPixels(), 0);
        ReliefCanvas none(0, 0, Layer::geometry(MakeRecord<Record>(p)).margin);  // a 2M x 2M frame
        none.Run<Layer, Record>(p);
    }
    for (float size : {1e9f, INFINITY, -50.0f, NAN}) {  // NaN last: it draws
        c.Run<Layer, Record>(Relief(0, 1, size));
        // NaN acts as 0; -50 gives a frame smaller than the text and draws nothing.
        EXPECT_EQ(c.DrawnPixels() > 0, size != size) << "size " << size;
        Record refused = MakeRecord<Record>(Relief(0, 1, size));
        bare.setProperty(&refused);
        EXPECT_TRUE(size != size || bare.getOffset() == 0) << "a refused size " << size << " kept a margin";
    }
}

TEST(ReliefLayers, BlendModesAndMissingOrExtremeInput) {
    // The largest sizes open windows past the root table (2 * 122^2, 2 * 68^2).
    ExpectModesAndCleanRefusals<GxBevel, GxBevelProperty>(
        kBevelVariant, {Relief(1, 0, 3), Relief(0, 1, 6, 4), Relief(0, 0, 15, 4), Relief(0, 1, 120, 16)});
    ExpectModesAndCleanRefusals<GxEmboss, GxEmbossProperty>(
        kEmbossVariant, {Relief(0, 1, 6), Relief(1, 1, 12, 3), Relief(0, 0, 26, 4), Relief(0, 1, 130, 16)});
}

// ---- each layer's own

TEST(Bevel, RadiiAndMargins) {
    struct Row { float size; int technique, soften, rs, rd, margin; bool exact; };
    for (Row r : {Row{15, 0, 0, 11, 11, 33, true},   // 2 * 15 / 3 + 1 = 11
                  Row{14, 0, 0, 11, 11, 33, true},   // 28 / 3 + 1 = 10.33: a real division
                  Row{3, 0, 5, 3, 3, 13, false},     // soften wider than the smoothing
                  Row{10, 1, 0, 0, 12, 12, false},   // hard: r + 2, never exact
                  Row{-1, 1, 0, 0, 1, 1, false},     // int(-1) = -1 toward zero: Rd = -1 + 2
                  Row{-3, 1, 1, 0, -1, 1, false}}) { // a negative range only empties the windows
        const auto g = GxBevel::geometry(MakeRecord<GxBevelProperty>(Relief(1, r.technique, r.size, r.soften)));
        EXPECT_TRUE(g.drawable && g.smoothRadius == r.rs && g.range == r.rd && g.margin == r.margin &&
                    g.exact == r.exact && g.gain == (r.technique == 0 ? 1.83f : 1.0f))
            << "wrong geometry for size " << r.size << " technique " << r.technique;
    }
    // Refused: past the radius limit, a frame smaller than the text, a blur
    // radius below zero.
    for (ReliefParams p : {Relief(1, 0, 1e9f), Relief(1, 1, -3), Relief(1, 0, -3, 4)})
        EXPECT_FALSE(GxBevel::geometry(MakeRecord<GxBevelProperty>(p)).drawable) << p.size;
    GxBevel bevel;
    GxBevelProperty record = MakeRecord<GxBevelProperty>(Relief(1, 0, 4.6f, 3));
    bevel.setProperty(&record);
    EXPECT_EQ(bevel.getOffset(), 3 + 5) << "the stack's margin is soften + size rounded";
}

TEST(Emboss, RadiiAndMargins) {
    struct Row { float size; int technique, soften, ro, ri, rs, margin; bool exact; };
    for (Row r : {Row{10, 1, 0, 8, 6, 0, 8, false},     // ceil(5 + 3), ceil(5 + 1)
                  Row{25, 0, 0, 8, 8, 14, 36, false},   // local passes up to 25
                  Row{26, 0, 16, 8, 8, 14, 40, true},   // the exact transform from 26
                  Row{-2, 1, 0, 2, 0, 0, 2, false},     // int(-2) = -2: Ro = 2, Ri = 0
                  Row{-9, 1, 2, -1, -3, 0, 3, false},   // negative ranges, frame from soften
                  Row{-3, 0, 0, 1, 1, 0, 1, false}}) {  // smoothing radius 0 still smooths
        const GxEmbossGeometry g =
            GxEmboss::geometry(MakeRecord<GxEmbossProperty>(Relief(0, r.technique, r.size, r.soften)));
        EXPECT_TRUE(g.drawable && g.outRange == r.ro && g.inRange == r.ri && g.smoothRadius == r.rs &&
                    g.margin == r.margin && g.exact == r.exact && g.gain == (r.technique == 0 ? 2.03f : 1.0f))
            << "wrong geometry for size " << r.size << " technique " << r.technique;
    }
    for (ReliefParams p : {Relief(0, 1, -9), Relief(0, 0, -4, 3)})  // M < 0; Rs = -1
        EXPECT_FALSE(GxEmboss::geometry(MakeRecord<GxEmbossProperty>(p)).drawable) << p.size;
    GxEmboss emboss;
    GxEmbossProperty record = MakeRecord<GxEmbossProperty>(Relief(0, 0, 10.5f, 2));
    emboss.setProperty(&record);
    EXPECT_EQ(emboss.getOffset(), 7 + 2) << "ceil(5.25 + 1) + soften: int(10.5) would give 6";
}

}  // namespace
}  // namespace Glimmer
