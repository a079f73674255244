#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include "effect/GxBlendRows.h"

namespace Glimmer::BlendRows {
namespace {

// The unpremultiply's division: the reference divides ((v + 1) t & 0xFF00) by
// the new alpha a; the kernels take q = (v + 1) t >> 8 and the reciprocal.
TEST(BlendRowsReciprocals, DivideExactlyForEveryNumeratorAndAlpha) {
    EXPECT_EQ(kReciprocals[0], 0u);
    for (uint32_t a = 1; a < 256; ++a)
        for (uint32_t q = 0; q < 256; ++q) ASSERT_EQ((q * kReciprocals[a]) >> 16, 256 * q / a) << q << "/" << a;
    for (uint32_t v = 0; v < 256; ++v)
        for (uint32_t t = 0; t < 256; ++t) ASSERT_EQ(((v + 1) * t) & 0xFF00u, (((v + 1) * t) >> 8) << 8);
}

// Bytes a compositor meets: mostly the edge values 0 and 255, the rest random.
struct Bytes {
    std::mt19937 random{2024};
    uint8_t Next() {
        const uint32_t r = random();
        switch (r % 5) {
            case 0: return 0;
            case 1: return 255;
            default: return uint8_t(r >> 8);
        }
    }
    std::vector<uint8_t> Make(size_t n) {
        std::vector<uint8_t> v(n);
        for (auto& b : v) b = Next();
        return v;
    }
    uint32_t Colour() { return uint32_t(Next()) << 24 | uint32_t(random() & 0xFFFFFF); }
};

// Runs one kernel of `table` on a copy of `dst` with guard bytes on both sides.
using Call = std::function<void(const Table&, uint8_t* dst, int n)>;
std::vector<uint8_t> RunKernel(const Table& table, const std::vector<uint8_t>& dst, int n, const Call& call) {
    constexpr size_t kGuard = 64;
    std::vector<uint8_t> buffer(dst.size() + 2 * kGuard, 0x5A);
    std::memcpy(buffer.data() + kGuard, dst.data(), dst.size());
    call(table, buffer.data() + kGuard, n);
    return buffer;
}

// Every kernel of every compiled variant beside the reference: random rows of
// every width from 1 to 64 and some long ones, random colours, destinations
// pre-filled with random bytes, compared with memcmp guard bytes included.
TEST(BlendRows, EveryKernelGivesTheReferenceBytes) {
    const auto variants = Variants();
    ASSERT_FALSE(variants.empty());
    Bytes bytes;
    std::vector<int> widths;
    for (int n = 1; n <= 64; ++n) widths.push_back(n);
    widths.insert(widths.end(), {100, 257, 1031});

    for (int n : widths) {
        for (int round = 0; round < 7; ++round) {
            std::vector<uint8_t> dst32 = bytes.Make(size_t(n) * 4);
            const std::vector<uint8_t> dst8 = bytes.Make(size_t(n));
            std::vector<uint8_t> cov = bytes.Make(size_t(n));
            // Rounds the kernels take shortcuts on: coverage mostly absent
            // over pictures mostly of transparent black, pictures of only
            // opaque and clear pixels (in runs), pictures of only clear ones
            // under runs of full coverage.
            if (round >= 4)
                for (size_t i = 0; i < cov.size(); ++i) cov[i] = i % 37 == 36 ? cov[i] : 0;
            if (round == 4)
                for (size_t i = 0; i < dst32.size(); ++i) dst32[i] = i / 4 % 37 == 36 ? dst32[i] : 0;
            if (round == 5)
                for (size_t i = 3; i < dst32.size(); i += 4) dst32[i] = i / 4 / 40 % 2 ? 255 : dst32[i] & 1 ? 255 : 0;
            if (round == 6) {
                for (size_t i = 3; i < dst32.size(); i += 4) dst32[i] = 0;
                for (size_t i = 0; i < cov.size(); ++i) cov[i] = i / 40 % 2 ? 255 : cov[i];
            }
            const std::vector<uint8_t> src32 = bytes.Make(size_t(n) * 4);
            std::vector<uint32_t> words(static_cast<size_t>(n));
            std::memcpy(words.data(), src32.data(), src32.size());
            const uint32_t colour = bytes.Colour();
            std::vector<uint32_t> table(256);  // a 0 first entry in even rounds, as a glow's
            for (auto& word : table) word = bytes.Colour();
            if (round % 2 == 0) table[0] = 0;
            const uint32_t alpha = round == 0 || round == 5 ? 255u : bytes.Next();

            const std::pair<const char*, Call> cases32[] = {
                {"srcOver8To32", [&](const Table& t, uint8_t* d, int k) { t.srcOver8To32(d, cov.data(), k, colour); }},
                {"dstOver8To32", [&](const Table& t, uint8_t* d, int k) { t.dstOver8To32(d, cov.data(), k, colour); }},
                {"dstOver8To32NSA",
                 [&](const Table& t, uint8_t* d, int k) { t.dstOver8To32NSA(d, cov.data(), k, colour); }},
                {"dstOverSA8To32",
                 [&](const Table& t, uint8_t* d, int k) { t.dstOverSA8To32(d, cov.data(), k, colour); }},
                {"copy8To32", [&](const Table& t, uint8_t* d, int k) { t.copy8To32(d, cov.data(), k, colour); }},
                {"srcOver32To32", [&](const Table& t, uint8_t* d, int k) { t.srcOver32To32(d, words.data(), k); }},
                {"dstOver32To32", [&](const Table& t, uint8_t* d, int k) { t.dstOver32To32(d, words.data(), k); }},
                {"dstOver32To32Bytes 0",
                 [&](const Table& t, uint8_t* d, int k) { t.dstOver32To32Bytes(d, src32.data(), k, 0); }},
                {"dstOver32To32Bytes 1",
                 [&](const Table& t, uint8_t* d, int k) { t.dstOver32To32Bytes(d, src32.data(), k, 1); }},
                {"swapRedBlue", [&](const Table& t, uint8_t* d, int k) { t.swapRedBlue(d, k); }},
                {"mergeWork", [&](const Table& t, uint8_t* d, int k) { t.mergeWork(d, src32.data(), cov.data(), k); }},
                {"unpremultiply", [&](const Table& t, uint8_t* d, int k) { t.unpremultiply(d, k, alpha); }},
                {"unpremultiplySwap", [&](const Table& t, uint8_t* d, int k) { t.unpremultiplySwap(d, k, alpha); }},
                {"dstOverTable32", [&](const Table& t, uint8_t* d, int k) { t.dstOverTable32(d, cov.data(), k, table.data()); }},
            };
            const Call max8 = [&](const Table& t, uint8_t* d, int k) { t.max8To8(d, cov.data(), k); };

            for (const auto& [name, call] : cases32) {
                const std::vector<uint8_t> expected = RunKernel(ScalarTable(), dst32, n, call);
                for (const auto& v : variants) {
                    const std::vector<uint8_t> got = RunKernel(*v.table, dst32, n, call);
                    ASSERT_EQ(std::memcmp(got.data(), expected.data(), got.size()), 0)
                        << v.name << " " << name << " width " << n << " colour " << std::hex << colour;
                }
            }
            const std::vector<uint8_t> expected = RunKernel(ScalarTable(), dst8, n, max8);
            for (const auto& v : variants)
                ASSERT_EQ(RunKernel(*v.table, dst8, n, max8), expected) << v.name << " max8To8 width " << n;
        }
    }
}

}  // namespace
}  // namespace Glimmer::BlendRows
