// Property records: the clamps and folds of their constructors, the key
// bytes of every kind, and the ownership of copied colour ramps.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstring>
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
    EXPECT_LE(written, size_t(reserved));
    EXPECT_EQ(buffer[written], 0) << "a zero byte follows the last piece";
    for (size_t i = written + 1; i < buffer.size(); ++i) EXPECT_EQ(buffer[i], 0x55) << i;
    return std::string(buffer.data(), written);
}

std::string Bytes(std::initializer_list<int> bytes) {
    std::string s;
    for (int b : bytes) s.push_back(char(b));
    return s;
}

std::string Join(std::initializer_list<std::string> parts) {
    std::string s;
    for (const std::string& part : parts) s.append(part);
    return s;
}

std::string Colour(uint32_t c) {
    std::string s;
    for (int shift = 28; shift >= 0; shift -= 4) s.push_back(char(0x80 | ((c >> shift) & 15)));
    return s;
}

TEST(PropertyKey, EveryKindByHand) {
    GxGradient glowStops[3] = {{0xFF000000, 1.0f, 0.0f}, {0x80FFFFFF, 1.0f, 0.5f}, {0x00123456, 1.0f, 0.999f}};
    GxGradient rampStops[2] = {{0xFF000000, 1.0f, 0.5f}, {0xFFFFFFFF, 1.0f, 1.0f}};
    GxBitmap tile(2, 2, 4);
    const struct {
        GxProperty* record;
        int reserved;
        std::string key;
        const char* why;
    } cases[] = {
        {new GxTextProperty(0xFF336699, 0.3f), 9, Join({"T", Colour(0xFF336699)}), "letter and colour"},
        {new GxOuterShadowProperty(-30.0f, 5.9f, 130.0f, 0x01234567, 1.0f), 13,
         Join({"S", Bytes({0x82, 0xCA, 0x85, 0x82}), Colour(0x01234567)}),
         "-30 as 330 = 2 * 128 + 74; size 130 keeps its low seven bits"},
        {new GxInnerShadowProperty(45.0f, 0.0f, 3.0f, 0xFF000000, 1.0f), 13,
         Join({"I", Bytes({0x80, 0xAD, 0x80, 0x83}), Colour(0xFF000000)}), "inner shadow"},
        {new GxStrokeProperty(5.7f, 0x12345678, 1.0f, 3, 1), 12,
         Join({"K", Bytes({0x85}), Colour(0x12345678), Bytes({0x83, 0x81})}), "stroke: both integers"},
        {new GxOuterGlowProperty(12.0f, 0xFF00FF00, 1.0f, 3, glowStops), 40,
         Join({"G", Bytes({0x8C}), Colour(0xFF00FF00), Colour(0xFF000000), Bytes({0x80}), Colour(0x80FFFFFF),
               Bytes({0xB2}), Colour(0x00123456), Bytes({0x80 | 99})}),
         "glow: one spare byte a stop"},
        {new GxInnerGlowProperty(1.0f, 0, 1.0f, 0, nullptr), 10, Join({"N", Bytes({0x81}), Colour(0)}), "no stops"},
        {new GxOuterGlowProperty(1.0f, 0, 1.0f, 4, nullptr), 50, Join({"G", Bytes({0x81}), Colour(0)}),
         "missing stops are never read"},
        {new GxOuterGlowProperty(1.0f, 0, 1.0f, -7, glowStops), 10, Join({"G", Bytes({0x81}), Colour(0)}),
         "a negative count"},
        {new GxLinearGradientProperty(45.0f, 1.5f, 1.0f, 2, rampStops), 25,
         Join({"L", Bytes({0x80, 0xAD, 0x89, 0x86}), Colour(0xFF000000), Bytes({0xB2}), Colour(0xFFFFFFFF),
               Bytes({0x80 | 100})}),
         "scale 150 = 0x96 as two nibbles"},
        {new GxRadialGradientProperty(0.0f, 2.0f, 1.0f, 0, nullptr), 5, Join({"D", Bytes({0x80, 0x80, 0x8C, 0x88})}),
         "scale 200 = 0xC8"},
        {new GxBevelProperty(1, 3.5f, 12.34f, 1, 0, 4, 0.8f, 120.0f, 30.0f, 0xFFFFFFFF, 1.0f, 0xFF000000, 1.0f), 30,
         Join({"B",
               Bytes({0x81, 0x80, 0x83, 0x80, 0x84, 0x8D, 0x82, 0x81, 0x80, 0x84, 0x80, 0x80 | 120, 0x80 | 30}),
               Colour(0xFFFFFFFF), Colour(0xFF000000)}),
         "depth 3 in two nibbles, size 1234 = 0x04D2 in four, 1, 0, 4, angle (0, 120), altitude 30"},
        {new GxEmbossProperty(3, 0.0f, 0.0f, 0, 1, 0, 1.0f, 0.0f, 0.0f, 0, 0.0f, 0, 0.0f), 30,
         Join({"E", Bytes({0x83, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x80, 0x81, 0x80, 0x80, 0x80, 0x80}), Colour(0),
               Colour(0)}),
         "emboss"},
        {new GxPatternProperty(&tile, 2.5f, 0.5f), 17,
         Join({"P", Colour(0), Bytes({0x80, 0x80, 0x8F, 0x8A, 0x80, 0x80, 0x83, 0x82})}), "pattern: its opacity"},
    };
    for (const auto& c : cases) {
        const std::unique_ptr<GxProperty> record(c.record);
        EXPECT_EQ(record->getSequentialCharLength(), c.reserved) << c.why;
        EXPECT_EQ(Key(*record), c.key) << c.why;
    }
}

TEST(PropertyKey, NoKeyByteIsZeroWhateverTheValues) {
    GxGradient stops[1] = {{0, 0.0f, -3.0f}};
    std::vector<GxProperty*> records = {
        new GxTextProperty(0, 0.0f),
        new GxOuterShadowProperty(-1e30f, -5.0f, 1e30f, 0, 0.0f),
        new GxStrokeProperty(-1.0f, 0, 0.0f, -128, 128),
        new GxOuterGlowProperty(0.0f, 0, 0.0f, 1, stops),
        new GxLinearGradientProperty(-720.0f, 0.0f, 0.0f, 1, stops),
        new GxBevelProperty(0, 0.0f, -1e9f, 0, 0, 0, 0.0f, -1.0f, -89.0f, 0, 0.0f, 0, 0.0f),
        new GxPatternProperty(nullptr, 0.0f, -1.0f),
    };
    for (GxProperty* p : records) {
        const std::string key = Key(*p);
        for (char c : key.substr(1)) EXPECT_NE(c & 0x80, 0) << key[0];
        delete p;
    }
}

TEST(PropertyRecord, ConstructorsClampAndFold) {
    // Only the inner shadow folds its angle; the sign of the dividend stays.
    EXPECT_EQ(GxOuterShadowProperty(-30.7f, 0, 0, 0, 0).angle, -30.7f);
    EXPECT_EQ(GxInnerShadowProperty(-30.7f, 0, 0, 0, 0).angle, -30.0f);
    EXPECT_EQ(GxInnerShadowProperty(400.0f, 0, 0, 0, 0).angle, 40.0f);

    GxLinearGradientProperty linear(-390.5f, 3.0f, 0.25f, 0, nullptr);
    EXPECT_EQ(linear.angle, -30.0f);
    EXPECT_EQ(linear.scale, 2.0f);
    EXPECT_EQ(linear.color, 0u);
    EXPECT_EQ(GxRadialGradientProperty(0, -1.0f, 0, 0, nullptr).scale, 0.0f);

    // Depth and soften are clamped, size is not (large bevels are real).
    GxBevelProperty bevel(2, 12.0f, 55.5f, 1, 1, 20, 0.5f, 725.9f, -100.5f, 1, 0.1f, 2, 0.2f);
    EXPECT_EQ(bevel.depth, 10.0f);
    EXPECT_EQ(bevel.size, 55.5f);
    EXPECT_EQ(bevel.soften, 16);
    EXPECT_EQ(bevel.angle, 5.0f);
    EXPECT_EQ(bevel.altitude, -10.0f);
    EXPECT_EQ(bevel.color, 0u);
    GxEmbossProperty emboss(3, -1.0f, 1.0f, 0, 0, -3, 1.0f, 0.0f, 0.0f, 0, 0.0f, 0, 0.0f);
    EXPECT_EQ(emboss.depth, 0.0f);
    EXPECT_EQ(emboss.soften, 0);

    EXPECT_EQ(GxPatternProperty(nullptr, 11.0f, 1.0f).scale, 10.0f);
    EXPECT_EQ(GxPatternProperty(nullptr, -1.0f, 1.0f).scale, 0.0f);
    EXPECT_EQ(GxPatternProperty(nullptr, 0.0f, 1.0f).color, 0u);

    // Values no integer can hold fold without undefined conversions.
    EXPECT_EQ(GxInnerShadowProperty(3e30f, 0, 0, 0, 0).angle, float(INT32_MAX % 360));
    EXPECT_EQ(GxInnerShadowProperty(std::nanf(""), 0, 0, 0, 0).angle, 0.0f);
}

TEST(PropertyRecord, CopiedStopsBelongToTheCopy) {
    auto* stops = new GxGradient[2]{{0xFF0000FF, 0.5f, 0.25f}, {0xFFFF0000, 1.0f, 0.75f}};
    GxOuterGlowProperty original(3.0f, 0, 1.0f, 2, stops);
    GxOuterGlowProperty copy(original);
    EXPECT_EQ(copy.stops, stops);  // a plain copy borrows
    ASSERT_TRUE(copy.copyStops());
    EXPECT_NE(copy.stops, stops);
    delete[] stops;  // the caller's array goes; the copy's stays readable
    EXPECT_EQ(copy.stops[1].color, 0xFFFF0000u);
    EXPECT_EQ(copy.stops[1].position, 0.75f);
    EXPECT_EQ(copy.stops[0].opacity, 0.5f);

    // Assigning over an owning record frees its stops (ASan checks the rest).
    GxOuterGlowProperty other(1.0f, 0, 1.0f, 0, nullptr);
    copy = other;
    EXPECT_EQ(copy.stops, nullptr);

    GxGradient one[1] = {{1, 0.0f, 0.0f}};
    GxLinearGradientProperty linear(0, 1, 1, 1, one);
    ASSERT_TRUE(linear.copyStops());
    EXPECT_NE(linear.stops, one);
    EXPECT_EQ(linear.stops[0].color, 1u);
    GxLinearGradientProperty none(0, 1, 1, 3, nullptr);
    EXPECT_TRUE(none.copyStops());
    EXPECT_EQ(none.stops, nullptr);
}

}  // namespace
}  // namespace Glimmer
