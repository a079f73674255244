// Property records: the clamps and folds of their constructors, the key
// bytes of every kind, and the ownership of copied colour ramps.

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstring>
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

TEST(PropertyKey, TextIsLetterAndColourNibbles) {
    GxTextProperty text(0xFF336699, 0.3f);
    EXPECT_EQ(text.getSequentialCharLength(), 9);
    EXPECT_EQ(Key(text), Join({"T", Bytes({0x8F, 0x8F, 0x83, 0x83, 0x86, 0x86, 0x89, 0x89})}));
}

TEST(PropertyKey, ShadowsWriteAngleDistanceSizeColour) {
    GxOuterShadowProperty outer(-30.0f, 5.9f, 130.0f, 0x01234567, 1.0f);
    EXPECT_EQ(outer.getSequentialCharLength(), 13);
    // -30 is written as 330: 2 * 128 + 74. Size 130 keeps its low seven bits.
    EXPECT_EQ(Key(outer), Join({"S", Bytes({0x82, 0xCA, 0x85, 0x82}), Colour(0x01234567)}));

    GxInnerShadowProperty inner(45.0f, 0.0f, 3.0f, 0xFF000000, 1.0f);
    EXPECT_EQ(inner.getSequentialCharLength(), 13);
    EXPECT_EQ(Key(inner), Join({"I", Bytes({0x80, 0xAD, 0x80, 0x83}), Colour(0xFF000000)}));
}

TEST(PropertyKey, StrokeWritesBothIntegers) {
    GxStrokeProperty stroke(5.7f, 0x12345678, 1.0f, 3, 1);
    EXPECT_EQ(stroke.getSequentialCharLength(), 12);
    EXPECT_EQ(Key(stroke), Join({"K", Bytes({0x85}), Colour(0x12345678), Bytes({0x83, 0x81})}));
}

TEST(PropertyKey, GlowsReserveOneSpareBytePerStop) {
    GxGradient stops[3] = {{0xFF000000, 1.0f, 0.0f}, {0x80FFFFFF, 1.0f, 0.5f}, {0x00123456, 1.0f, 0.999f}};
    GxOuterGlowProperty glow(12.0f, 0xFF00FF00, 1.0f, 3, stops);
    EXPECT_EQ(glow.getSequentialCharLength(), 40);
    const std::string key = Key(glow);
    EXPECT_EQ(key.size(), 37u);
    EXPECT_EQ(key, Join({"G", Bytes({0x8C}), Colour(0xFF00FF00), Colour(0xFF000000), Bytes({0x80}),
                         Colour(0x80FFFFFF), Bytes({0xB2}), Colour(0x00123456), Bytes({0x80 | 99})}));

    GxInnerGlowProperty inner(1.0f, 0, 1.0f, 0, nullptr);
    EXPECT_EQ(inner.getSequentialCharLength(), 10);
    EXPECT_EQ(Key(inner), Join({"N", Bytes({0x81}), Colour(0)}));
    // Stops that are not there are never read, whatever the count says.
    GxOuterGlowProperty missing(1.0f, 0, 1.0f, 4, nullptr);
    EXPECT_EQ(Key(missing).size(), 10u);
    GxOuterGlowProperty negative(1.0f, 0, 1.0f, -7, stops);
    EXPECT_EQ(negative.getSequentialCharLength(), 10);
    EXPECT_EQ(Key(negative).size(), 10u);
}

TEST(PropertyKey, GradientsWriteAngleScaleAndStops) {
    GxGradient stops[2] = {{0xFF000000, 1.0f, 0.5f}, {0xFFFFFFFF, 1.0f, 1.0f}};
    GxLinearGradientProperty linear(45.0f, 1.5f, 1.0f, 2, stops);
    EXPECT_EQ(linear.getSequentialCharLength(), 25);
    // Scale 1.5 -> 150 = 0x96 as two nibbles.
    EXPECT_EQ(Key(linear), Join({"L", Bytes({0x80, 0xAD, 0x89, 0x86}), Colour(0xFF000000),
                                 Bytes({0xB2}), Colour(0xFFFFFFFF), Bytes({0x80 | 100})}));
    GxRadialGradientProperty radial(0.0f, 2.0f, 1.0f, 0, nullptr);
    EXPECT_EQ(radial.getSequentialCharLength(), 5);
    EXPECT_EQ(Key(radial), Join({"D", Bytes({0x80, 0x80, 0x8C, 0x88})}));  // 200 = 0xC8
}

TEST(PropertyKey, BevelAndEmbossWriteThirtyBytes) {
    GxBevelProperty bevel(1, 3.5f, 12.34f, 1, 0, 4, 0.8f, 120.0f, 30.0f, 0xFFFFFFFF, 1.0f,
                          0xFF000000, 1.0f);
    EXPECT_EQ(bevel.getSequentialCharLength(), 30);
    // depth 3 as two nibbles, size 1234 = 0x04D2 as four, then 1, 0, 4, angle
    // 120 (0, 120), altitude 30, the two colours.
    EXPECT_EQ(Key(bevel), Join({"B",
                                Bytes({0x81, 0x80, 0x83, 0x80, 0x84, 0x8D, 0x82, 0x81, 0x80, 0x84, 0x80,
                                       0x80 | 120, 0x80 | 30}),
                                Colour(0xFFFFFFFF), Colour(0xFF000000)}));
    GxEmbossProperty emboss(3, 0.0f, 0.0f, 0, 1, 0, 1.0f, 0.0f, 0.0f, 0, 0.0f, 0, 0.0f);
    EXPECT_EQ(emboss.getSequentialCharLength(), 30);
    EXPECT_EQ(Key(emboss)[0], 'E');
    EXPECT_EQ(Key(emboss).size(), 30u);
}

TEST(PropertyKey, PatternWritesItsOpacity) {
    GxBitmap tile(2, 2, 4);
    GxPatternProperty pattern(&tile, 2.5f, 0.5f);
    EXPECT_EQ(pattern.getSequentialCharLength(), 17);
    EXPECT_EQ(Key(pattern), Join({"P", Colour(0), Bytes({0x80, 0x80, 0x8F, 0x8A, 0x80, 0x80, 0x83, 0x82})}));
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
