#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

std::wstring Text(const GxString& s) { return s.GetPointer() != nullptr ? s.GetPointer() : L"<null>"; }

std::string Utf8(const GxString& s) {
    std::vector<char> buffer(size_t(s.GetUTF8Size()) + 1, '\x7F');
    int n = s.GetUTF8(buffer.data(), int(buffer.size()));
    EXPECT_EQ(n + 1, s.GetUTF8Size());
    return std::string(buffer.data(), size_t(n > 0 ? n : 0));
}

std::vector<uint16_t> Utf16(const GxString& s) {
    uint16_t* units = s.GetUTF16();
    std::vector<uint16_t> out;
    for (uint16_t* p = units; *p != 0; ++p) out.push_back(*p);
    delete[] units;
    return out;
}

using Testing::CodeOf;

TEST(GxString, UnconstructedStringFailsEverywhereWithCode8) {
    Testing::LogCapture capture;
    GxString s;
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetLength(), -1); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Append("x")); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetUTF8Size(), -1); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_NE(s.CompareTo("a"), 0); }), 8);
    // Still a terminated buffer, so a caller can hand it on without a check.
    EXPECT_EQ(CodeOf([&] { EXPECT_TRUE(Utf16(s).empty()); }), 8);
    for (const auto& line : capture.Lines()) {
        EXPECT_EQ(line.tag, "GxString");
        EXPECT_EQ(line.priority, 6);
        EXPECT_EQ(line.message.rfind("@ Native Error 8 : ", 0), 0u) << line.message;
    }
    EXPECT_EQ(capture.Lines().size(), 5u);

    // An unconstructed source is refused the same way.
    GxString target;
    ASSERT_TRUE(target.Construct(L"keep"));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(target.Append(&s)); }), 8);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(GxString().Construct(&s)); }), 8);
    EXPECT_EQ(Text(target), L"keep");
}

TEST(GxString, ConstructOnceFromEachSource) {
    GxString a;
    ASSERT_TRUE(a.Construct(L"first"));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(a.Construct(L"second")); }), 4);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(a.Construct()); }), 4);
    EXPECT_EQ(Text(a), L"first");

    GxString b;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(b.Construct(static_cast<const char*>(nullptr))); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(b.Construct(L"abc", -1)); }), 7);
    EXPECT_TRUE(b.Construct());  // the failures left it free to be constructed

    GxString copy, prefix, widePrefix, longAsk, fromBytes;
    ASSERT_TRUE(copy.Construct(&a));
    ASSERT_TRUE(prefix.Construct(&a, 3));
    ASSERT_TRUE(widePrefix.Construct(L"abcdef", 2));
    ASSERT_TRUE(longAsk.Construct(L"ab", 100));  // never reads past the terminator
    ASSERT_TRUE(fromBytes.Construct("h\xC3\xA9"));
    EXPECT_EQ(Text(copy), L"first");
    EXPECT_EQ(Text(prefix), L"fir");
    EXPECT_EQ(Text(widePrefix), L"ab");
    EXPECT_EQ(Text(longAsk), L"ab");
    EXPECT_EQ(Text(fromBytes), L"h\u00E9");
    EXPECT_EQ(fromBytes.GetLength(), 2);
}

TEST(GxString, EditingKeepsExactContents) {
    GxString s;
    ASSERT_TRUE(s.Construct(L"world"));
    EXPECT_TRUE(s.Insert(L"hello ", 0));
    EXPECT_TRUE(s.Append("!"));
    EXPECT_EQ(Text(s), L"hello world!");
    EXPECT_TRUE(s.Remove(5, 6));
    EXPECT_EQ(Text(s), L"hello!");
    EXPECT_TRUE(s.Remove(4, 100));  // the count is cut at the end
    EXPECT_EQ(Text(s), L"hell");

    // A string used as its own source.
    EXPECT_TRUE(s.Append(&s));
    EXPECT_EQ(Text(s), L"hellhell");
    EXPECT_TRUE(s.Insert(&s, 4));
    EXPECT_EQ(Text(s), L"hellhellhellhell");
    EXPECT_TRUE(s.SetSubstring(&s, 2, 4));
    EXPECT_EQ(Text(s), L"llhe");
    EXPECT_TRUE(s.SetSubstring(&s, 4, 9));
    EXPECT_EQ(Text(s), L"");

    GxString t;
    ASSERT_TRUE(t.Construct("abc"));
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(t.Insert(L"x", 4)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(t.Insert(L"x", -1)); }), 3);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(t.Remove(0, -1)); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(t.SetSubstring(&t, 5, 1)); }), 3);
    EXPECT_EQ(Text(t), L"abc");
    EXPECT_TRUE(t.Insert(L"x", 3));  // the end itself is a valid place
    EXPECT_EQ(Text(t), L"abcx");

    wchar_t c = 0;
    EXPECT_TRUE(t.GetChar(3, &c));
    EXPECT_EQ(c, L'x');
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(t.GetChar(4, &c)); }), 3);

    // Set from null empties and succeeds.
    EXPECT_EQ(CodeOf([&] { EXPECT_TRUE(t.Set(static_cast<const char*>(nullptr))); }), 0);
    EXPECT_EQ(t.GetLength(), 0);
}

TEST(GxString, DecodesUtf8StrictlyButAcceptsJavaSurrogates) {
    GxString s;
    ASSERT_TRUE(s.Construct());
    struct Case {
        const char* bytes;
        std::wstring expected;
    };
    const Case good[] = {
        {"\x7F", L"\x7F"},
        {"\xC2\x80", L"\x80"},
        {"\xDF\xBF", L"\x7FF"},
        {"\xE0\xA0\x80", L"\x800"},
        {"\xEF\xBF\xBF", L"\xFFFF"},
        {"\xF0\x90\x80\x80", L"\x10000"},
        {"\xF4\x8F\xBF\xBF", L"\x10FFFF"},
        // Java's modified UTF-8: a pair of 3-byte surrogates is one character...
        {"\xED\xA0\xBD\xED\xB8\x80", L"\x1F600"},
        // ...and a lone surrogate (or two in the wrong order) stays as it is.
        {"\xED\xA0\xBDz", std::wstring{wchar_t(0xD83D), L'z'}},
        {"\xED\xB8\x80\xED\xA0\xBD", std::wstring{wchar_t(0xDE00), wchar_t(0xD83D)}},
    };
    for (const Case& c : good) {
        EXPECT_TRUE(s.Set(c.bytes)) << c.bytes;
        EXPECT_EQ(Text(s), c.expected);
    }

    ASSERT_TRUE(s.Set(L"unchanged"));
    const char* bad[] = {
        "\xC0\x80",              // overlong NUL (modified UTF-8's form is not taken)
        "\xC1\xBF",              // overlong
        "\xE0\x9F\xBF",          // overlong 3-byte
        "\xF0\x8F\xBF\xBF",      // overlong 4-byte
        "\xF4\x90\x80\x80",      // above U+10FFFF
        "\xF5\x80\x80\x80",      // no such lead byte
        "\xF8\x88\x80\x80\x80",  // 5-byte forms are not read
        "\x80",                  // stray continuation
        "ab\xE2\x82",            // cut short by the terminator
        "\xE2\x28\xA1",          // broken continuation
    };
    for (const char* b : bad) {
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Set(b)); }), 7) << b;
        EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(s.Append(b)); }), 7) << b;
        EXPECT_EQ(Text(s), L"unchanged");
    }
}

TEST(GxString, Utf8SizeFollowsTheSixByteRule) {
    GxString s;
    ASSERT_TRUE(s.Construct());
    EXPECT_EQ(s.GetUTF8Size(), 1);
    const std::pair<uint32_t, int> sizes[] = {
        {0x7F, 1},      {0x80, 2},       {0x7FF, 2},       {0x800, 3},        {0xFFFF, 3},
        {0x10000, 4},   {0x1FFFFF, 4},   {0x200000, 5},    {0x3FFFFFF, 5},    {0x4000000, 6},
        {0x7FFFFFFF, 6}, {0x80000000, 6}, {0xFFFFFFFF, 6},
    };
    for (auto [c, bytes] : sizes) {
        const wchar_t one[2] = {wchar_t(c), 0};
        ASSERT_TRUE(s.Set(one));
        EXPECT_EQ(s.GetUTF8Size(), bytes + 1) << std::hex << c;
    }
}

TEST(GxString, EncodesUtf8ToTheByte) {
    GxString s;
    ASSERT_TRUE(s.Construct(L"A\u00E9\u20AC\U0001F600"));
    EXPECT_EQ(Utf8(s), "A\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80");

    // Beyond Unicode the long forms are written, so the size always holds.
    const wchar_t wide[] = {wchar_t(0xD800), wchar_t(0x200000), wchar_t(0x7FFFFFFF), 0};
    ASSERT_TRUE(s.Set(wide));
    EXPECT_EQ(Utf8(s), "\xED\xA0\x80\xF8\x88\x80\x80\x80\xFD\xBF\xBF\xBF\xBF\xBF");

    // Only whole characters go into a short buffer, and it is terminated.
    ASSERT_TRUE(s.Set(L"a\u00E9b"));
    char small[3] = {'x', 'x', 'x'};
    EXPECT_EQ(s.GetUTF8(small, 3), 1);  // 'a' fits, the 2-byte character not
    EXPECT_STREQ(small, "a");
    char exact[5];
    EXPECT_EQ(s.GetUTF8(exact, 5), 4);
    EXPECT_STREQ(exact, "a\xC3\xA9" "b");
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetUTF8(nullptr, 4), -1); }), 7);

    // No form at all from 0x80000000 up: the text before it is kept.
    const wchar_t negative[] = {L'o', L'k', wchar_t(0x80000000u), L'z', 0};
    ASSERT_TRUE(s.Set(negative));
    char out[16];
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(s.GetUTF8(out, 16), -1); }), 7);
    EXPECT_STREQ(out, "ok");
}

TEST(GxString, Utf16CountsUFFFFAsAPair) {
    GxString s;
    ASSERT_TRUE(s.Construct());
    EXPECT_EQ(s.GetUTF16Size(), 1);
    EXPECT_TRUE(Utf16(s).empty());

    ASSERT_TRUE(s.Set(L"\xFFFF"));
    EXPECT_EQ(s.GetUTF16Size(), 3);
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{0xD7FF, 0xDFFF}));

    ASSERT_TRUE(s.Set(L"\xFFFE"));
    EXPECT_EQ(s.GetUTF16Size(), 2);
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{0xFFFE}));

    const wchar_t mixed[] = {L'A', wchar_t(0x1F600), wchar_t(0x10000), wchar_t(0x10FFFF),
                             wchar_t(0xDC00), wchar_t(0x110041), 0};
    ASSERT_TRUE(s.Set(mixed));
    EXPECT_EQ(s.GetUTF16Size(), 1 + 1 + 2 + 2 + 2 + 1 + 1);
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{0x0041, 0xD83D, 0xDE00, 0xD800, 0xDC00, 0xDBFF,
                                               0xDFFF, 0xDC00, 0x0041}));

    // A Java string comes in as modified UTF-8 and goes back as the same units.
    ASSERT_TRUE(s.Set("a\xED\xA0\xBD\xED\xB8\x80" "b\xED\xB0\x80"));
    EXPECT_EQ(Utf16(s), (std::vector<uint16_t>{'a', 0xD83D, 0xDE00, 'b', 0xDC00}));
}

TEST(GxString, ComparesAndFinds) {
    GxString s, other;
    ASSERT_TRUE(s.Construct("abcabc"));
    ASSERT_TRUE(other.Construct(&s));
    EXPECT_EQ(s.CompareTo(&other), 0);
    EXPECT_EQ(s.CompareTo("abcabc"), 0);
    EXPECT_LT(s.CompareTo("abd"), 0);
    EXPECT_GT(s.CompareTo("abc"), 0);       // longer wins over its prefix
    EXPECT_LT(s.CompareTo("abcabcz"), 0);
    EXPECT_EQ(s.CompareTo("abcX", 3), 0);   // only the first three take part
    EXPECT_GT(s.CompareTo("ab", 3), 0);     // "abc" against "ab"
    EXPECT_EQ(s.CompareTo("", 0), 0);
    // Code points compare unsigned, whatever the sign of wchar_t.
    const wchar_t high[] = {wchar_t(0x80000000u), 0};
    ASSERT_TRUE(other.Set(high));
    EXPECT_GT(other.CompareTo("a"), 0);
    EXPECT_EQ(CodeOf([&] { EXPECT_NE(s.CompareTo(static_cast<const GxString*>(nullptr)), 0); }), 7);
    EXPECT_EQ(CodeOf([&] { EXPECT_NE(s.CompareTo("abc", -1), 0); }), 7);

    EXPECT_EQ(s.Find(L"bc"), 1);
    EXPECT_EQ(s.ReverseFind(L"bc"), 4);
    EXPECT_EQ(s.ReverseFind("ca"), 2);
    EXPECT_EQ(s.ReverseFind(L"abcabc"), 0);
    EXPECT_EQ(s.Find(L"abcabca"), -1);  // longer than the text
    EXPECT_EQ(s.Find("x"), -1);
    EXPECT_EQ(s.Find(L""), 0);
    EXPECT_EQ(s.ReverseFind(""), 6);
}

}  // namespace
}  // namespace Glimmer
