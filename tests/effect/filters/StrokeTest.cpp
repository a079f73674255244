#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <memory>
#include <random>
#include <vector>

#include "effect/filters/GxStroke.h"
#include "effect/filters/GxStrokeRows.h"
#include "effect/filters/LayerHarness.h"

namespace Glimmer {
namespace {

using namespace Testing;

struct Kernel {
    int size = 0;
    unsigned char* bytes = nullptr;
    explicit Kernel(float r) { size = makeCircleKernel(&bytes, r); }
    ~Kernel() { std::free(bytes); }
    std::vector<int> Values() const { return std::vector<int>(bytes, bytes + size * size); }
};

std::unique_ptr<GxStroke> MakeStroke(float size, int position, unsigned color = kWhite) {
    auto stroke = std::make_unique<GxStroke>();
    GxStrokeProperty record(size, color, 1.0f, 0, position);
    stroke->setProperty(&record);
    return stroke;
}

// The discs of r = 0.5 and r = 2 are checked through the layer below.
TEST(StrokeKernel, SizeZeroAndRefusedRadii) {
    EXPECT_EQ(Kernel(0.0f).Values(), std::vector<int>{0});  // size 0: no stroke at all
    unsigned char marker = 7;
    for (float r : {std::nanf(""), -3.0f, 5000.0f}) {
        unsigned char* out = &marker;
        EXPECT_EQ(makeCircleKernel(&out, r), 0) << r;
        EXPECT_EQ(out, &marker) << r;
    }
}

// Plain stamping as the band functions define it, without their shortcuts.
void ReferenceSpread(const std::vector<uint8_t>& pad, int W, int H, const unsigned char* k, int D,
                     bool inverse, uint8_t* out) {
    const int Wo = W + D - 1;
    for (int y = 0; y < H; ++y) {
        for (int x = 0; x < W; ++x) {
            const int v = inverse ? 255 - pad[size_t(y) * W + x] : pad[size_t(y) * W + x];
            if (v == 0) continue;
            for (int ky = 0; ky < D; ++ky) {
                for (int kx = 0; kx < D; ++kx) {
                    uint8_t& o = out[size_t(y + ky) * Wo + x + kx];
                    const int kv = k[ky * D + kx];
                    const int cand = kv < 255 ? std::max(v + kv - 255, 0) : v;
                    if (o != 255 && cand > o) o = uint8_t(cand);
                }
            }
        }
    }
}

TEST(StrokeBands, BandsAndChordsAgreeWithPlainStamping) {
    // Text-like padded masks: solid blocks, plateaus of one mid value (ties
    // decide which pixels may skip their stamp), specks, a zero frame.
    std::mt19937 rng(1234);
    auto randomMask = [&](int W, int H) {
        std::vector<uint8_t> m(size_t(W) * H, 0);
        for (int b = 0; b < 4; ++b) {
            const int x0 = 1 + int(rng() % unsigned(W - 2)), y0 = 1 + int(rng() % unsigned(H - 2));
            const int x1 = std::min(W - 1, x0 + 1 + int(rng() % 8)), y1 = std::min(H - 1, y0 + 1 + int(rng() % 6));
            const uint8_t v = b % 2 == 0 ? 255 : uint8_t(rng() % 256);
            for (int y = y0; y < y1; ++y) std::fill(m.begin() + y * W + x0, m.begin() + y * W + x1, v);
        }
        for (int s = 0; s < W * H / 8; ++s)
            m[size_t(1 + rng() % unsigned(H - 2)) * W + 1 + rng() % unsigned(W - 2)] = uint8_t(rng() % 256);
        return m;
    };
    // A ring, weaker in the middle: no pixel may stand in for a neighbour's stamp.
    unsigned char ring[9] = {255, 255, 255, 255, 0, 255, 255, 255, 255};
    using Band = void* (*)(void*);
    const Band bands[] = {GxStroke::partalDTStrokeOutside, GxStroke::partalDTStrokeInside,
                          GxStroke::partalDTStrokeCenter};
    // The chords (what the layer runs) must agree too: fractional radii,
    // radii below 1, runs cut off by the kernel's square, masks smaller than
    // the disc.
    for (float r : {-1.0f, 0.3f, 0.5f, 0.8f, 1.0f, 1.7f, 3.6f, 4.3f, 6.5f, 11.2f}) {
        Kernel disc(r);
        unsigned char* k = r < 0 ? ring : disc.bytes;
        const int D = r < 0 ? 3 : disc.size, R = D >> 1;
        StrokeChords chords;
        const bool planned = chords.plan(k, D);
        EXPECT_EQ(planned, r >= 0) << r;  // every disc is chords, the ring is not
        for (int trial = 0; trial < 5; ++trial) {
            const int W = 3 + int(rng() % 25), H = 3 + int(rng() % 15);
            std::vector<uint8_t> pad = randomMask(W, H);
            const int P = (W + 2 * R) * (H + 2 * R);
            for (int mode = 0; mode < 3; ++mode) {
                std::vector<uint8_t> want(size_t(2) * P, 0);
                ReferenceSpread(pad, W, H, k, D, mode == 1, want.data());
                if (mode == 2) ReferenceSpread(pad, W, H, k, D, true, want.data() + P);
                if (planned) {
                    // The zero frame given, or (odd trials) added by the spread.
                    const int frame = trial % 2;
                    const uint8_t* inner = pad.data() + frame * (W + 1);
                    size_t bytes = 0;
                    ASSERT_TRUE(chords.workBytes(W - 2 * frame, H - 2 * frame, frame, &bytes));
                    // The whole plane, or (trial 2) a part of it; every byte of it is written.
                    const int Wo = W + 2 * R, Ho = H + 2 * R;
                    StrokeChords::Window window{0, 0, Wo, Ho};
                    std::vector<uint8_t> expect = want;
                    if (trial == 2) {
                        window.left = int(rng() % unsigned(Wo));
                        window.top = int(rng() % unsigned(Ho));
                        window.width = 1 + int(rng() % unsigned(Wo - window.left));
                        window.height = 1 + int(rng() % unsigned(Ho - window.top));
                        for (int plane = 0; plane < 2; ++plane)
                            for (int y = 0; y < Ho; ++y)
                                for (int x = 0; x < Wo; ++x)
                                    if (x < window.left || x >= window.left + window.width || y < window.top ||
                                        y >= window.top + window.height)
                                        expect[size_t(plane) * P + size_t(y) * Wo + x] = 77;
                    }
                    std::vector<uint8_t> work(bytes), got(size_t(2) * P, 0);
                    std::fill(got.begin(), got.begin() + (mode == 2 ? 2 : 1) * P, 77);
                    if (mode != 2) std::fill(expect.begin() + P, expect.end(), 0);
                    auto spread = [&](bool inverse, uint8_t* out) {
                        chords.spread(inner, W, W - 2 * frame, H - 2 * frame, frame, inverse, work.data(), window,
                                      out + size_t(window.top) * Wo + window.left, size_t(Wo));
                    };
                    spread(mode == 1, got.data());
                    if (mode == 2) spread(true, got.data() + P);
                    ASSERT_EQ(got, expect) << "chords r=" << r << " mode=" << mode << " " << W << "x" << H;
                }
                for (int pieces : {1, 3}) {
                    std::vector<uint8_t> got(size_t(2) * P, 0);
                    for (int b = 0; b < pieces; ++b) {
                        StrokeJob job{got.data(), pad.data(), k, W, H, 0, 0, W + 2 * R, H + 2 * R, R, R, P,
                                      R, D, W, H, H * b / pieces, H * (b + 1) / pieces};
                        EXPECT_EQ(bands[mode](&job), nullptr);
                    }
                    ASSERT_EQ(got, want) << "r=" << r << " mode=" << mode << " pieces=" << pieces;
                }
            }
        }
    }
    // A full source pixel adds nothing to the inverse.
    std::vector<uint8_t> full(25, 255), plane(81, 0);
    Kernel two(2.0f);
    StrokeJob job{plane.data(), full.data(), two.bytes, 5, 5, 0, 0, 9, 9, 2, 2, 81, 2, 5, 5, 5, 0, 5};
    GxStroke::partalDTStrokeInside(&job);
    EXPECT_EQ(plane, std::vector<uint8_t>(81, 0));
}

// Every compiled row kernel beside the reference: random span rows of
// mostly 0 and 255, random terms (some full, some cut), every width from 1
// to 64 and some long ones, outputs poisoned with random bytes.
TEST(StrokeRows, EveryKernelGivesTheReferenceBytes) {
    std::mt19937 rng(99);
    auto bytes = [&](size_t n) {
        std::vector<uint8_t> v(n);
        for (auto& b : v) b = rng() % 3 == 0 ? uint8_t(rng()) : rng() % 2 ? 255 : 0;
        return v;
    };
    const auto variants = StrokeRows::Variants();
    ASSERT_FALSE(variants.empty());
    std::vector<int> widths;
    for (int n = 1; n <= 64; ++n) widths.push_back(n);
    widths.insert(widths.end(), {100, 257, 1031});
    for (int n : widths) {
        const std::vector<uint8_t> a = bytes(size_t(n) + 40), b = bytes(size_t(n) + 40);
        for (int round = 0; round < 12; ++round) {
            const int kind = round % 4;
            // Kind 0 has no full terms, kind 2 enough for blocks to go on
            // alone or in quarters, from a source of 255 but for one run of
            // random bytes (a few pixels stay short of 255), kind 3 a full
            // 255 source (blocks stop early).
            std::vector<StrokeRows::Term> terms;
            const int flat = kind == 0 ? 0 : int(rng() % (kind == 2 ? 24 : 6));
            const int count = flat + int(rng() % (kind == 2 ? 64 : 8));
            std::vector<uint8_t> run(size_t(n) + 40, 255);
            const size_t at = rng() % run.size(), length = std::min<size_t>(50 + rng() % 20, run.size() - at);
            for (size_t i = at; i < at + length; ++i) run[i] = rng() % 2 ? uint8_t(rng()) : 0;
            for (int i = 0; i < count; ++i) {
                const std::vector<uint8_t>& from = kind == 2 ? run : i % 2 ? a : b;
                terms.push_back({from.data() + rng() % 40, from.data() + rng() % 40,
                                 uint8_t(i < flat ? 0 : rng() % 256)});
            }
            std::vector<uint8_t> full(size_t(n) + 40, 255);
            if (kind == 3 && flat > 0) terms[0].a = full.data();
            std::vector<uint8_t> want = bytes(size_t(n));
            const std::vector<uint8_t> poison = want;
            StrokeRows::Reference::DilateRow(terms.data(), flat, count, n, want.data());
            std::vector<uint8_t> wantMax = poison, wantMin = poison;
            StrokeRows::Reference::MaxRow(a.data(), b.data() + 3, n, wantMax.data());
            StrokeRows::Reference::MinRow(wantMin.data(), a.data(), n);
            for (const auto& v : variants) {
                std::vector<uint8_t> got = poison, gotMax = poison, gotMin = poison;
                v.table->dilateRow(terms.data(), flat, count, n, got.data());
                v.table->maxRow(a.data(), b.data() + 3, n, gotMax.data());
                v.table->minRow(gotMin.data(), a.data(), n);
                ASSERT_EQ(got, want) << v.name << " width " << n << " round " << round;
                ASSERT_EQ(gotMax, wantMax) << v.name << " width " << n;
                ASSERT_EQ(gotMin, wantMin) << v.name << " width " << n;
            }
        }
    }
}

TEST(StrokeLayer, MarginsAndSizeZero) {
    EXPECT_EQ(GxStroke().getOffset(), 0);
    EXPECT_EQ(GxStroke().getStyle(), 10);
    auto margin = [](float size, int position) { return MakeStroke(size, position)->getOffset(); };
    EXPECT_EQ(margin(2.0f, 1), 2);
    EXPECT_EQ(margin(2.6f, 1), 3);
    EXPECT_EQ(margin(3.0f, 0), 2);
    EXPECT_EQ(margin(7.0f, 2) + margin(7.0f, 5) + margin(-4.0f, 1), 0);
    EXPECT_EQ(margin(100.0f, 1), 100);
    EXPECT_EQ(margin(1e9f, 1), 0);  // refused: draws nothing, needs no room
    // Size 0 draws nothing in any position.
    GxBitmap mask = MaskFromPicture({"........", "..##+...", "..###...", "...+....", "........"});
    for (int position : {0, 1, 2, 5})
        EXPECT_EQ(LayerAlpha(*MakeStroke(0.0f, position), mask, GxRect(1, 1, 6, 4)), std::vector<uint8_t>(40, 0));
}

TEST(StrokeLayer, HandValuesAroundOnePixel) {
    GxBitmap mask(12, 12, 1);
    FillRect(mask, 6, 6, 7, 7, 255);
    const GxRect box(6, 6, 7, 7);
    // Outside, size 2: the disc stamped on the pixel. This places the output
    // plane one frame pixel plus R = 2 left of and above the box.
    std::vector<uint8_t> outside = LayerAlpha(*MakeStroke(2.0f, 1), mask, box);
    EXPECT_EQ(Window(outside, 12, 4, 4, 9, 9),
              (Rows{{44, 195, 255, 195, 44}, {195, 255, 255, 255, 195}, {255, 255, 255, 255, 255},
                    {195, 255, 255, 255, 195}, {44, 195, 255, 195, 44}}));
    EXPECT_EQ(std::count(outside.begin(), outside.end(), 0), 144 - 25);
    // Centre, size 1 (r = 0.5, R = 1): the inverse reaches 128 everywhere, so
    // the minimum is the disc: centre and edges 128 (the centre deliberately
    // weaker than full), corners clamp(1.5 - 1.414) -> 22.
    std::vector<uint8_t> centre = LayerAlpha(*MakeStroke(1.0f, 0), mask, box);
    EXPECT_EQ(Window(centre, 12, 5, 5, 8, 8), (Rows{{22, 128, 22}, {128, 128, 128}, {22, 128, 22}}));
    EXPECT_EQ(std::count(centre.begin(), centre.end(), 0), 144 - 9);
}

// An 8x8 block in a 20x20 mask, text box two pixels wider; row 10 crosses
// the block from x = 6 to 13.
struct Block {
    GxBitmap mask{20, 20, 1};
    GxRect rect{4, 4, 16, 16};
    Block() { FillRect(mask, 6, 6, 14, 14, 255); }
    std::vector<int> Row10(GxStroke& stroke) { return Window(LayerAlpha(stroke, mask, rect), 20, 0, 10, 20, 11)[0]; }
};

TEST(StrokeLayer, BandLiesAlongTheEdgeByPosition) {
    Block block;
    const int F = 255;
    // Centre, size 4: two pixels either side of each edge.
    EXPECT_EQ(block.Row10(*MakeStroke(4.0f, 0)),
              (std::vector<int>{0, 0, 0, 0, F, F, F, F, 0, 0, 0, 0, F, F, F, F, 0, 0, 0, 0}));
    // Outside, size 2: the glyph and two pixels beyond, nothing further.
    EXPECT_EQ(block.Row10(*MakeStroke(2.0f, 1)),
              (std::vector<int>{0, 0, 0, 0, F, F, F, F, F, F, F, F, F, F, F, F, 0, 0, 0, 0}));
    // Inside, size 2: two pixels in from each edge, the interior clear, and
    // (deliberately: compositing decides what shows) everything outside the
    // glyph to the plane's border.
    std::vector<int> inside = block.Row10(*MakeStroke(2.0f, 2));
    EXPECT_EQ(inside, (std::vector<int>{0, F, F, F, F, F, F, F, 0, 0, 0, 0, F, F, F, F, F, F, F, 0}));
    EXPECT_EQ(block.Row10(*MakeStroke(2.0f, 5)), inside);  // unknown positions stroke inside
}

TEST(StrokeLayer, BlendModeAndSecondTarget) {
    Block block;
    // Over opaque white, the centre stroke in the normal mode draws
    // source-over (black shows), into both targets; with a separate work
    // image, or in another position, destination-over (white stays).
    auto over = [&](int position, int separate, GxBitmap* extra = nullptr) {
        GxBitmap dst(20, 20, 4);
        std::fill(dst.pixels, dst.pixels + 1600, 255);
        RunLayer(*MakeStroke(4.0f, position, 0xFF000000u), block.mask, dst, block.rect, separate, extra);
        return dst.pixels[(10 * 20 + 5) * 4];
    };
    GxBitmap extra(20, 20, 4);
    EXPECT_EQ(over(0, 0, &extra), 0);
    EXPECT_EQ(extra.pixels[(10 * 20 + 5) * 4 + 3], 255);
    EXPECT_EQ(over(0, 1), 255);
    EXPECT_EQ(over(1, 0), 255);
}

TEST(StrokeLayer, ExtremeAndBadInputsAreClean) {
    // Size 100 around a glyph in the corner of a tiny image: clipped on every side.
    GxBitmap corner = MaskFromPicture({"#+......", "##......", "........"});
    EXPECT_EQ(LayerAlpha(*MakeStroke(100.0f, 1), corner, GxRect(0, 0, 2, 2)), std::vector<uint8_t>(24, 255));
    EXPECT_EQ(LayerAlpha(*MakeStroke(100.0f, 0), corner, GxRect(0, 0, 2, 2))[23], 255);
    LayerAlpha(*MakeStroke(100.0f, 2), corner, GxRect(0, 0, 2, 2));  // clean under ASan
    EXPECT_EQ(LayerAlpha(*MakeStroke(1e6f, 1), corner, GxRect(0, 0, 2, 2)), std::vector<uint8_t>(24, 0));

    Block block;
    auto stroke = MakeStroke(2.0f, 1);
    // A box of no rows copies nothing and strokes nothing.
    EXPECT_EQ(LayerAlpha(*stroke, block.mask, GxRect(4, 8, 16, 8)), std::vector<uint8_t>(400, 0));
    EXPECT_TRUE(BadCallsDrawNothing(*stroke, block.mask, block.rect, GxRect(10, 4, 6, 16)));
    // A box reaching off the mask is read as its part on the mask.
    EXPECT_EQ(LayerAlpha(*stroke, block.mask, GxRect(-3, 4, 90, 16)),
              LayerAlpha(*stroke, block.mask, GxRect(0, 4, 20, 16)));
}

}  // namespace
}  // namespace Glimmer
