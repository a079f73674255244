// Property records: key bytes by hand, the clamps and folds of their
// constructors, and the ownership of copied colour ramps.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "effect/GxProperty.h"

namespace Glimmer {
namespace {

// Serialises into a buffer poisoned with 0x55 and checks the record stays
// within its reserved length plus the terminating zero.
std::string Key(const GxProperty& p) {
    const int reserved = p.getSequentialCharLength();
    std::vector<char> buffer(size_t(reserved) + 8, 0x55);
    char* cursor = buffer.data();
    EXPECT_TRUE(p.toSequentialChar(&cursor));
    const size_t written = size_t(cursor - buffer.data());
    EXPECT_LE(written, size_t(reserved)) << "the key overran its reserved length";
    EXPECT_EQ(buffer[written], 0) << "no zero byte follows the key";
    for (size_t i = written + 1; i < buffer.size(); ++i) EXPECT_EQ(buffer[i], 0x55) << "written past the key at " << i;
    return std::string(buffer.data(), written);
}

// Pieces of a key: a letter, bytes given as numbers, and colours as eight
// nibbles, each with the top bit set.
std::string K(std::initializer_list<std::string> parts) {
    std::string s;
    for (const std::string& part : parts) s.append(part);
    return s;
}
std::string B(std::initializer_list<int> bytes) { return std::string(bytes.begin(), bytes.end()); }
std::string C(uint32_t c) {
    std::string s;
    for (int shift = 28; shift >= 0; shift -= 4) s.push_back(char(0x80 | ((c >> shift) & 15)));
    return s;
}

TEST(PropertyKey, BytesByHandAndNeverAZeroByte) {
    GxGradient glowStops[3] = {{0xFF000000, 1.0f, 0.0f}, {0x80FFFFFF, 1.0f, 0.5f}, {0x00123456, 1.0f, 0.999f}};
    GxGradient rampStops[2] = {{0xFF000000, 1.0f, 0.5f}, {0xFFFFFFFF, 1.0f, 1.0f}};
    GxBitmap tile(2, 2, 4);
    const struct {
        GxProperty* record;
        int reserved;
        std::string key;
        const char* why;
    } cases[] = {
        {new GxOuterShadowProperty(-30.0f, 5.9f, 130.0f, 0x01234567, 1.0f), 13,
         K({"S", B({0x82, 0xCA, 0x85, 0x82}), C(0x01234567)}),
         "-30 as 330 = 2 * 128 + 74; size 130 keeps its low seven bits"},
        {new GxStrokeProperty(5.7f, 0x12345678, 1.0f, 3, 1), 12, K({"K", B({0x85}), C(0x12345678), B({0x83, 0x81})}),
         "stroke: both integers"},
        {new GxOuterGlowProperty(12.0f, 0xFF00FF00, 1.0f, 3, glowStops), 40,
         K({"G", B({0x8C}), C(0xFF00FF00), C(0xFF000000), B({0x80}), C(0x80FFFFFF), B({0xB2}), C(0x00123456),
            B({0x80 | 99})}),
         "glow: one position byte a stop"},
        {new GxOuterGlowProperty(1.0f, 0, 1.0f, 4, nullptr), 50, K({"G", B({0x81}), C(0)}), "missing stops unread"},
        {new GxOuterGlowProperty(1.0f, 0, 1.0f, -7, glowStops), 10, K({"G", B({0x81}), C(0)}), "a negative count"},
        {new GxLinearGradientProperty(45.0f, 1.5f, 1.0f, 2, rampStops), 25,
         K({"L", B({0x80, 0xAD, 0x89, 0x86}), C(0xFF000000), B({0xB2}), C(0xFFFFFFFF), B({0x80 | 100})}),
         "scale 150 = 0x96 as two nibbles"},
        {new GxBevelProperty(1, 3.5f, 12.34f, 1, 0, 4, 0.8f, 120.0f, 30.0f, 0xFFFFFFFF, 1.0f, 0xFF000000, 1.0f), 30,
         K({"B", B({0x81, 0x80, 0x83, 0x80, 0x84, 0x8D, 0x82, 0x81, 0x80, 0x84, 0x80, 0x80 | 120, 0x80 | 30}),
            C(0xFFFFFFFF), C(0xFF000000)}),
         "depth 3 in two nibbles, size 1234 = 0x04D2 in four, 1, 0, 4, angle (0, 120), altitude 30"},
        {new GxPatternProperty(&tile, 2.5f, 0.5f), 17,
         K({"P", C(0), B({0x80, 0x80, 0x8F, 0x8A, 0x80, 0x80, 0x83, 0x82})}), "pattern: its opacity"},
    };
    for (const auto& c : cases) {
        const std::unique_ptr<GxProperty> record(c.record);
        EXPECT_EQ(record->getSequentialCharLength(), c.reserved) << c.why;
        EXPECT_EQ(Key(*record), c.key) << c.why;
    }
    // Whatever the values, no key byte is zero (the key is a C string).
    GxGradient odd[1] = {{0, 0.0f, -3.0f}};
    for (GxProperty* p : std::initializer_list<GxProperty*>{
             new GxOuterShadowProperty(-1e30f, -5.0f, 1e30f, 0, 0.0f), new GxStrokeProperty(-1.0f, 0, 0.0f, -128, 128),
             new GxOuterGlowProperty(0.0f, 0, 0.0f, 1, odd), new GxLinearGradientProperty(-720.0f, 0.0f, 0.0f, 1, odd),
             new GxBevelProperty(0, 0.0f, -1e9f, 0, 0, 0, 0.0f, -1.0f, -89.0f, 0, 0.0f, 0, 0.0f),
             new GxPatternProperty(nullptr, 0.0f, -1.0f)}) {
        const std::string key = Key(*p);
        for (char c : key.substr(1)) EXPECT_NE(c & 0x80, 0) << "a byte without its top bit in key " << key[0];
        delete p;
    }
}

TEST(PropertyRecord, ConstructorsClampAndFold) {
    // The inner shadow folds its angle (the sign of the dividend stays), and
    // values no integer can hold fold without undefined conversions.
    EXPECT_EQ(GxInnerShadowProperty(-30.7f, 0, 0, 0, 0).angle, -30.0f);
    EXPECT_EQ(GxInnerShadowProperty(3e30f, 0, 0, 0, 0).angle, float(INT32_MAX % 360));
    EXPECT_EQ(GxInnerShadowProperty(std::nanf(""), 0, 0, 0, 0).angle, 0.0f);
    EXPECT_EQ(GxLinearGradientProperty(-390.5f, 3.0f, 0.25f, 0, nullptr).scale, 2.0f);
    // Depth and soften are clamped, size is not (large bevels are real).
    GxBevelProperty bevel(2, 12.0f, 55.5f, 1, 1, 20, 0.5f, 725.9f, -100.5f, 1, 0.1f, 2, 0.2f);
    EXPECT_EQ((std::vector<float>{bevel.depth, bevel.size, float(bevel.soften), bevel.angle, bevel.altitude}),
              (std::vector<float>{10.0f, 55.5f, 16.0f, 5.0f, -10.0f}));
    GxEmbossProperty emboss(3, -1.0f, 1.0f, 0, 0, -3, 1.0f, 0.0f, 0.0f, 0, 0.0f, 0, 0.0f);
    EXPECT_TRUE(emboss.depth == 0.0f && emboss.soften == 0);
}

TEST(PropertyRecord, CopiedStopsBelongToTheCopy) {
    auto* stops = new GxGradient[2]{{0xFF0000FF, 0.5f, 0.25f}, {0xFFFF0000, 1.0f, 0.75f}};
    GxOuterGlowProperty original(3.0f, 0, 1.0f, 2, stops);
    GxOuterGlowProperty copy(original);
    EXPECT_EQ(copy.stops, stops) << "a plain copy borrows";
    ASSERT_TRUE(copy.copyStops());
    delete[] stops;  // the caller's array goes; the copy's stays readable (ASan checks)
    EXPECT_TRUE(copy.stops[1].color == 0xFFFF0000u && copy.stops[1].position == 0.75f);
    copy = GxOuterGlowProperty(1.0f, 0, 1.0f, 0, nullptr);  // frees the owned stops (ASan checks)
    EXPECT_EQ(copy.stops, nullptr);
    GxLinearGradientProperty none(0, 1, 1, 3, nullptr);
    EXPECT_TRUE(none.copyStops() && none.stops == nullptr);
}

}  // namespace
}  // namespace Glimmer
