#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

using Testing::CodeOf;

std::wstring Text(const GxString& s) { return s.GetPointer() != nullptr ? s.GetPointer() : L"<null>"; }

std::vector<uint16_t> Utf16(const GxString& s) {
    uint16_t* units = s.GetUTF16();
    std::vector<uint16_t> out;
    for (uint16_t* p = units; *p != 0; ++p) out.push_back(*p);
    delete[] units;
    return out;
}

TEST(GxString, UnconstructedFailsWithCode8AndASecondConstructWithCode4) {
    Testing::LogCapture capture;
    GxString s;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetLength(), -1); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Append("x")); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_TRUE(Utf16(s).empty()); }), 8);   // still a terminated buffer
    EXPECT_EQ(capture.CountErrors("GxString", 8), 3);
    GxString target;
    ASSERT_TRUE(target.Construct(L"keep"));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(target.Append(&s)); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(target.Construct(L"second")); }), 4);
    EXPECT_EQ(Text(target), L"keep");
}

TEST(GxString, EditsKeepExactContentsAndRefuseBadPlaces) {
    GxString s;
    ASSERT_TRUE(s.Construct(L"hello world", 4));   // the first four
    EXPECT_TRUE(s.Append(&s));   // a string used as its own source
    EXPECT_TRUE(s.Insert(&s, 4));
    EXPECT_TRUE(s.SetSubstring(&s, 2, 4));
    EXPECT_TRUE(s.Remove(3, 100));   // the count is cut at the end
    EXPECT_EQ(Text(s), L"llh");
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Insert(L"x", 4)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Remove(0, -1)); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.SetSubstring(&s, 4, 1)); }), 3);
    EXPECT_EQ(Text(s), L"llh");
    GxString prefix;
    ASSERT_TRUE(prefix.Construct(L"ab", 100));   // never reads past the terminator
    EXPECT_EQ(Text(prefix), L"ab");
}

std::string Utf8(const GxString& s) {
    char out[16] = {};
    const int n = s.GetUTF8(out, sizeof out);
    EXPECT_EQ(n + 1, s.GetUTF8Size());
    return std::string(out, size_t(std::max(n, 0)));
}

// UTF-8 in, code points, UTF-8 out ("" when the same bytes come back).
TEST(GxString, ConvertsUtf8BothWaysAndAcceptsJavaSurrogates) {
    GxString s;
    ASSERT_TRUE(s.Construct());
    const struct {
        std::string in;
        std::wstring text;
        std::string out;
    } cases[] = {
        {"\x7F", L"\x7F", ""},
        {"\xDF\xBF", L"\x7FF", ""},
        {"\xE2\x82\xAC", L"\x20AC", ""},
        {"\xEF\xBF\xBF", L"\xFFFF", ""},
        {"\xF0\x9F\x98\x80", L"\x1F600", ""},
        {"\xF4\x8F\xBF\xBF", L"\x10FFFF", ""},
        {"\xED\xA0\xBD\xED\xB8\x80", L"\x1F600", "\xF0\x9F\x98\x80"},   // a pair of 3-byte surrogates is one
        {"\xED\xA0\xBDz", {wchar_t(0xD83D), L'z'}, ""},                   // a lone one stays as it is
        {"\xED\xB8\x80\xED\xA0\xBD", {wchar_t(0xDE00), wchar_t(0xD83D)}, ""},
    };
    for (const auto& c : cases) {
        ASSERT_TRUE(s.Set(c.in.c_str())) << c.in;
        EXPECT_EQ(Text(s), c.text) << c.in;
        EXPECT_EQ(Utf8(s), c.out.empty() ? c.in : c.out) << c.in;
    }
    // Beyond Unicode the long forms are written, so the size always holds.
    for (const auto& [c, utf8] : {std::pair{0x200000u, "\xF8\x88\x80\x80\x80"}, {0x7FFFFFFFu, "\xFD\xBF\xBF\xBF\xBF\xBF"}}) {
        ASSERT_TRUE(s.Set(std::wstring(1, wchar_t(c)).c_str()));
        EXPECT_EQ(Utf8(s), utf8);
    }

    ASSERT_TRUE(s.Set(L"unchanged"));
    const char* bad[] = {
        "\xC0\x80",         "\xC1\xBF",         "\xE0\x9F\xBF",         "\xF0\x8F\xBF\xBF",   // overlong
        "\xF4\x90\x80\x80", "\xF5\x80\x80\x80", "\xF8\x88\x80\x80\x80",   // too high, no such lead
        "\x80",             "ab\xE2\x82",       "\xE2\x28\xA1",           // stray, cut, broken
    };
    for (const char* b : bad) {
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Set(b)); }), 7) << b;
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Append(b)); }), 7) << b;
        EXPECT_EQ(Text(s), L"unchanged");
    }
    // Only whole characters go into a short buffer; nothing from 0x80000000 up.
    ASSERT_TRUE(s.Set(L"a\u00E9b"));
    char small[3] = {'x', 'x', 'x'};
    EXPECT_EQ(s.GetUTF8(small, 3), 1);
    EXPECT_STREQ(small, "a");
    const wchar_t negative[] = {L'o', L'k', wchar_t(0x80000000u), 0};
    ASSERT_TRUE(s.Set(negative));
    char out[16];
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetUTF8(out, 16), -1); }), 7);
    EXPECT_STREQ(out, "ok");
}

TEST(GxString, Utf16WritesPairsAndCountsUFFFFAsOne) {
    GxString s;
    ASSERT_TRUE(s.Construct());
    const wchar_t mixed[] = {L'A', wchar_t(0x1F600), wchar_t(0x10000), wchar_t(0x10FFFF), wchar_t(0xDC00),
                             wchar_t(0x110041), wchar_t(0xFFFE), wchar_t(0xFFFF), 0};
    ASSERT_TRUE(s.Set(mixed));
    EXPECT_EQ(s.GetUTF16Size(), 1 + 2 + 2 + 2 + 1 + 1 + 1 + 2 + 1);
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{0x0041, 0xD83D, 0xDE00, 0xD800, 0xDC00, 0xDBFF, 0xDFFF, 0xDC00,
                                               0x0041, 0xFFFE, 0xD7FF, 0xDFFF}));
    // A Java string comes in as modified UTF-8 and goes back as the same units.
    ASSERT_TRUE(s.Set("a\xED\xA0\xBD\xED\xB8\x80" "b\xED\xB0\x80"));
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{'a', 0xD83D, 0xDE00, 'b', 0xDC00}));
}

TEST(GxString, ComparesCodePointsUnsigned) {
    GxString s, other;
    ASSERT_TRUE(s.Construct("abcabc"));
    EXPECT_EQ(s.CompareTo("abcabc"), 0);
    EXPECT_LT(s.CompareTo("abd"), 0);
    EXPECT_GT(s.CompareTo("abc"), 0);       // longer wins over its prefix
    EXPECT_EQ(s.CompareTo("abcX", 3), 0);   // only the first three take part
    const wchar_t high[] = {wchar_t(0x80000000u), 0};
    ASSERT_TRUE(other.Construct(high));
    EXPECT_GT(other.CompareTo("a"), 0);
    EXPECT_EQ(CodeOf([&] { EXPECT_NE(s.CompareTo(static_cast<const GxString*>(nullptr)), 0); }), 7);

}

}  // namespace
}  // namespace Glimmer
