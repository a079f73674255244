#include <gtest/gtest.h>

#include <cstring>

#include "foundation/GxBitmap.h"

namespace Glimmer {
namespace {

bool AllZero(const GxBitmap& b) {
    size_t n = size_t(b.width) * b.height * b.bytesPerPixel;
    for (size_t i = 0; i < n; ++i)
        if (b.pixels[i] != 0) return false;
    return true;
}

TEST(GxBitmap, ConstructorsSetFormatAndClearPixels) {
    GxBitmap empty;
    EXPECT_EQ(empty.width, 0u);
    EXPECT_EQ(empty.pixels, nullptr);
    EXPECT_EQ(empty.format, 4u);  // deliberately neither 1 nor 2
    EXPECT_EQ(empty.bytesPerPixel, 0u);

    GxBitmap mask(7, 3, 1);
    ASSERT_NE(mask.pixels, nullptr);
    EXPECT_EQ(mask.format, 2u);
    EXPECT_TRUE(AllZero(mask));

    GxBitmap color(5, 4, 4);
    ASSERT_NE(color.pixels, nullptr);
    EXPECT_EQ(color.format, 1u);
    EXPECT_TRUE(AllZero(color));
}

TEST(GxBitmap, SizeProductThatDoesNotFitIsRefused) {
    // 65536 x 65536 x 4 wraps to 0 in 32 bits; it must not allocate that.
    GxBitmap huge(65536, 65536, 4);
    EXPECT_EQ(huge.pixels, nullptr);
    EXPECT_EQ(huge.width, 65536u);
    EXPECT_EQ(huge.height, 65536u);
    EXPECT_EQ(huge.format, 1u);

    unsigned char data[4] = {1, 2, 3, 4};
    GxBitmap wrapped(0x80000000u, 2, data, 1);
    EXPECT_EQ(wrapped.pixels, nullptr);

    size_t bytes = 0;
    EXPECT_FALSE(GxBitmap::PixelBytes(46341, 46341, 1, &bytes));
    EXPECT_TRUE(GxBitmap::PixelBytes(46340, 46340, 1, &bytes));
    EXPECT_EQ(bytes, size_t(46340) * 46340);
}

TEST(GxBitmap, WrappingConstructorCopiesCallerData) {
    unsigned char data[6] = {1, 2, 3, 4, 5, 6};
    GxBitmap b(3, 2, data, 1);
    ASSERT_NE(b.pixels, nullptr);
    data[0] = 99;
    EXPECT_EQ(b.pixels[0], 1);
    EXPECT_EQ(b.pixels[5], 6);
}

TEST(GxBitmap, CopyAndAssignmentDuplicatePixels) {
    GxBitmap a(2, 2, 4);
    a.pixels[0] = 10;
    a.pixels[15] = 20;
    GxBitmap copy(a);
    ASSERT_NE(copy.pixels, a.pixels);
    EXPECT_EQ(0, std::memcmp(copy.pixels, a.pixels, 16));

    GxBitmap assigned(9, 9, 1);
    assigned = a;
    EXPECT_EQ(assigned.width, 2u);
    EXPECT_EQ(assigned.format, 1u);
    EXPECT_EQ(assigned.pixels[15], 20);

    GxBitmap& self = assigned;
    assigned = self;
    ASSERT_NE(assigned.pixels, nullptr);
    EXPECT_EQ(assigned.pixels[0], 10);
}

TEST(GxBitmap, SubImageCopiesOneBytePerPixel) {
    GxBitmap src(4, 3, 1);
    for (int i = 0; i < 12; ++i) src.pixels[i] = uint8_t(i);
    GxRect r(1, 1, 3, 3);
    GxBitmap sub(src, &r);
    ASSERT_EQ(sub.width, 2u);
    ASSERT_EQ(sub.height, 2u);
    EXPECT_EQ(sub.pixels[0], 5);
    EXPECT_EQ(sub.pixels[1], 6);
    EXPECT_EQ(sub.pixels[2], 9);
    EXPECT_EQ(sub.pixels[3], 10);

    GxRect swapped(3, 0, 1, 2);  // positive size, nothing copied
    GxBitmap none(src, &swapped);
    EXPECT_EQ(none.width, 2u);
    EXPECT_EQ(none.height, 2u);
    // A rectangle reaching outside the source reads nothing beyond its block.
    GxRect outside(-2, 2, 2, 4);
    GxBitmap partly(src, &outside);
    ASSERT_EQ(partly.width, 4u);
    ASSERT_NE(partly.pixels, nullptr);
    EXPECT_EQ(partly.pixels[0], 6);  // byte -2 + 2 x 4
    EXPECT_EQ(partly.pixels[3], 9);
    // Corners at the ends of the int32 range: the size is their distance.
    GxRect wide(INT32_MIN, 0, INT32_MAX, 0);
    EXPECT_EQ(uint32_t(wide.Width()), 0xFFFFFFFFu);
}

}  // namespace
}  // namespace Glimmer
