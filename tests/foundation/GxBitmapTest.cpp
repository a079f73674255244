#include <gtest/gtest.h>

#include <cstring>
#include <vector>

#include "foundation/GxBitmap.h"

namespace Glimmer {
namespace {

TEST(GxBitmap, FormatsFollowTheDepthAndCopiesOwnTheirPixels) {
    EXPECT_EQ(GxBitmap().format, 4u);   // deliberately neither 1 nor 2
    GxBitmap mask(7, 3, 1);
    EXPECT_EQ(mask.format, 2u);
    GxBitmap color(2, 2, 4);
    EXPECT_EQ(color.format, 1u);
    ASSERT_NE(color.pixels, nullptr);
    EXPECT_EQ(color.pixels[15], 0);   // cleared
    color.pixels[15] = 20;
    GxBitmap assigned(9, 9, 1);
    assigned = color;
    GxBitmap& self = assigned;
    assigned = self;
    ASSERT_NE(assigned.pixels, color.pixels);
    EXPECT_EQ(assigned.format, 1u);
    EXPECT_EQ(assigned.pixels[15], 20);
}

// A size whose byte count does not fit an int32 gets no pixels (65536^2 x 4
// wraps to 0 in 32 bits), never a short block.
TEST(GxBitmap, SizesTooLargeGetNoPixels) {
    GxBitmap huge(65536, 65536, 4);
    EXPECT_EQ(huge.pixels, nullptr);
    EXPECT_EQ(huge.width, 65536u);
    unsigned char data[4] = {1, 2, 3, 4};
    EXPECT_EQ(GxBitmap(0x80000000u, 2, data, 1).pixels, nullptr);
    size_t bytes = 0;
    EXPECT_FALSE(GxBitmap::PixelBytes(46341, 46341, 1, &bytes));
    EXPECT_TRUE(GxBitmap::PixelBytes(46340, 46340, 1, &bytes));
    EXPECT_EQ(bytes, size_t(46340) * 46340);
}

TEST(GxBitmap, SubImageCopiesOneBytePerPixel) {
    GxBitmap src(4, 3, 1);
    for (int i = 0; i < 12; ++i) src.pixels[i] = uint8_t(i);
    GxRect r(1, 1, 3, 3);
    GxBitmap sub(src, &r);
    ASSERT_EQ(sub.width, 2u);
    ASSERT_EQ(sub.height, 2u);
    EXPECT_EQ(std::vector<uint8_t>(sub.pixels, sub.pixels + 4), (std::vector<uint8_t>{5, 6, 9, 10}));
    // A rectangle reaching outside the source reads nothing beyond its block.
    GxRect outside(-2, 2, 2, 4);
    GxBitmap partly(src, &outside);
    ASSERT_NE(partly.pixels, nullptr);
    EXPECT_EQ(partly.pixels[0], 6);   // byte -2 + 2 x 4
}

}  // namespace
}  // namespace Glimmer
