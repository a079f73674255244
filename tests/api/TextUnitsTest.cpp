// UTF-8 text as the core takes it: units, code points and byte offsets.

#include <gtest/gtest.h>

#include "api/TextUnits.h"

namespace glimmer::detail {
namespace {

TEST(TextUnitsTest, EveryUnitKnowsItsByteOffset) {
    TextUnits units;
    // a, e-acute (2 bytes), CR LF (one break), a CJK ideograph (3), an emoji (4, a surrogate pair)
    ASSERT_EQ(DecodeText("a\xC3\xA9\r\n\xE6\x97\xA5\xF0\x9F\x98\x80", &units), "");
    EXPECT_EQ(units.utf16, u"a\u00E9\n\u65E5\U0001F600");
    EXPECT_EQ(units.codePoints, L"a\u00E9\n\u65E5\U0001F600");
    EXPECT_EQ(units.utf8Offsets, (std::vector<size_t>{0, 1, 4, 5, 8, 8, 12}));

    ASSERT_EQ(DecodeText("a\rb", &units), "");   // a lone CR stays
    EXPECT_EQ(units.utf16, u"a\rb");
}

TEST(TextUnitsTest, MalformedTextIsRefusedWithItsPlace) {
    TextUnits units;
    const struct {
        const char* text;
        size_t size;
        const char* message;
    } cases[] = {
        {"ab\xC3", 3, "not valid UTF-8 (at byte 2)"},          // truncated
        {"\xC0\xAF", 2, "not valid UTF-8 (at byte 0)"},        // overlong
        {"\xED\xA0\x80", 3, "not valid UTF-8 (at byte 0)"},    // a surrogate
        {"\xF4\x90\x80\x80", 4, "not valid UTF-8 (at byte 0)"},  // past U+10FFFF
        {"x\x80", 2, "not valid UTF-8 (at byte 1)"},           // a lone continuation byte
        {"a\0b", 3, "U+0000 (at byte 1)"},
    };
    for (const auto& c : cases) {
        const std::string message = DecodeText(std::string_view(c.text, c.size), &units);
        EXPECT_NE(message.find(c.message), std::string::npos) << message;
    }
}

}  // namespace
}  // namespace glimmer::detail
