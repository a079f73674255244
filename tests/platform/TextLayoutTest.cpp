#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <limits>
#include <map>
#include <numeric>
#include <random>
#include <string>
#include <vector>

#include "platform/Font.h"
#include "platform/SystemFonts.h"
#include "platform/TextLayout.h"
#include "text/TextFixtures.h"

namespace Glimmer::Platform {
namespace {

using Glimmer::Testing::ReadFile;

// Font bytes live as long as the test binary; fonts borrow them.
const std::vector<char>& Bytes(const char* path) {
    static std::map<std::string, std::vector<char>>* files = new std::map<std::string, std::vector<char>>();
    auto found = files->find(path);
    if (found == files->end()) found = files->emplace(path, ReadFile(path)).first;
    return found->second;
}

std::shared_ptr<Font> Open(const char* path, int index = 0) {
    const std::vector<char>& bytes = Bytes(path);
    return CreateFont(bytes.data(), bytes.size(), index, FontData::kBorrowed);
}

std::shared_ptr<FontFamily> FamilyOf(std::vector<FontFamily::Member> members) {
    return std::make_shared<FontFamily>(0u, 0, std::move(members));
}

std::u16string U16(const char16_t* text) { return text; }

const uint16_t* Units(const std::u16string& text) {
    return reinterpret_cast<const uint16_t*>(text.data());
}

Layout LayOut(const Typeface& typeface, const std::u16string& text, Paint paint = Paint(),
              Bidi bidi = Bidi::kDefaultLtr) {
    Layout layout;
    EXPECT_TRUE(LayoutText(paint, bidi, typeface, Units(text), text.size(), 0, text.size(), 0,
                           text.size(), &layout));
    return layout;
}

class TextLayoutTest : public ::testing::Test {
protected:
    void SetUp() override {
        sans = Open(Glimmer::Testing::kDejaVuSans);
        bold = Open(Glimmer::Testing::kDejaVuSansBold);
        cjk = Open(Glimmer::Testing::kNotoCjk, 2);
        ASSERT_NE(sans, nullptr);
        ASSERT_NE(bold, nullptr);
        ASSERT_NE(cjk, nullptr);
        regular.families = {FamilyOf({{sans, 400, false}})};
    }

    std::shared_ptr<Font> sans, bold, cjk;
    Typeface regular;
};

TEST_F(TextLayoutTest, FontsAreMadeOnlyOfReadableFacesInRange) {
    const std::vector<char>& bytes = Bytes(Glimmer::Testing::kDejaVuSans);
    EXPECT_EQ(CreateFont(nullptr, 100, 0, FontData::kBorrowed), nullptr);
    EXPECT_EQ(CreateFont(bytes.data(), 0, 0, FontData::kBorrowed), nullptr);
    EXPECT_EQ(CreateFont(bytes.data(), bytes.size(), -1, FontData::kBorrowed), nullptr);
    EXPECT_EQ(CreateFont(bytes.data(), bytes.size(), 1, FontData::kBorrowed), nullptr);
    EXPECT_EQ(CreateFont(bytes.data(), bytes.size(), 0x10000, FontData::kBorrowed), nullptr);
    std::vector<char> noise(4096);
    std::mt19937 random(7);
    for (char& c : noise) c = char(random());
    EXPECT_EQ(CreateFont(noise.data(), noise.size(), 0, FontData::kBorrowed), nullptr);

    EXPECT_STREQ(sans->FamilyName(), "DejaVu Sans");
    EXPECT_TRUE(sans->HasGlyph('A'));
    EXPECT_FALSE(sans->HasGlyph(0x6F22));
    // Faces of one collection are told apart by index.
    EXPECT_STREQ(cjk->FamilyName(), "Noto Sans CJK SC");
    EXPECT_STREQ(Open(Glimmer::Testing::kNotoCjk, 0)->FamilyName(), "Noto Sans CJK JP");
    EXPECT_TRUE(cjk->HasGlyph(0x6F22));
}

TEST_F(TextLayoutTest, GlyphsGoLeftToRightOnTheBaselineAndScaleLinearly) {
    Paint paint;
    paint.size = 20.0f;
    Layout small = LayOut(regular, U16(u"Hello"), paint);
    ASSERT_EQ(small.glyphs.size(), 5u);
    ASSERT_EQ(small.runs.size(), 1u);
    EXPECT_EQ(small.runs[0].font, sans);
    for (size_t i = 1; i < small.glyphs.size(); ++i) EXPECT_GT(small.glyphs[i].x, small.glyphs[i - 1].x);
    for (const LayoutGlyph& glyph : small.glyphs) EXPECT_EQ(glyph.y, 0.0f);
    EXPECT_GT(small.advance, small.glyphs.back().x);
    // Ink above the baseline only ("Hello" has no descender); cap height ~ 0.73 em.
    EXPECT_LT(small.bounds.top, -13.0f);
    EXPECT_GT(small.bounds.top, -17.0f);
    EXPECT_LE(small.bounds.bottom, 1.0f);

    paint.size = 40.0f;
    EXPECT_EQ(LayOut(regular, U16(u"Hello"), paint).advance, 2.0f * small.advance);
    paint.size = 20.0f;
    paint.scaleX = 2.0f;
    EXPECT_EQ(LayOut(regular, U16(u"Hello"), paint).advance, 2.0f * small.advance);
    paint.scaleX = 1.0f;
    paint.letterSpacing = 0.5f;   // half an em per cluster
    EXPECT_NEAR(LayOut(regular, U16(u"Hello"), paint).advance, small.advance + 5 * 10.0f, 0.01f);
}

TEST_F(TextLayoutTest, BadRangesAndEmptyInputsGiveEmptyLayouts) {
    std::u16string text = u"abc";
    Paint paint;
    Layout layout;
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 2, 2, 0, 3, &layout));
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 1, 1, 2, 1, &layout));
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 0, 3, 0, 2, &layout));
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, nullptr, 3, 0, 3, 0, 3, &layout));
    EXPECT_TRUE(layout.glyphs.empty());

    EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 1, 0, 0, 3, &layout));
    EXPECT_TRUE(layout.glyphs.empty());
    EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, Typeface(), Units(text), 3, 0, 3, 0, 3, &layout));
    EXPECT_TRUE(layout.glyphs.empty());
    for (float size : {0.0f, -5.0f, 1.0e30f, std::numeric_limits<float>::quiet_NaN()}) {
        paint.size = size;
        EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 0, 3, 0, 3, &layout));
        EXPECT_TRUE(layout.glyphs.empty());
        EXPECT_EQ(layout.advance, 0.0f);
    }
}

TEST_F(TextLayoutTest, EachCharacterComesFromTheFirstFamilyThatHasIt) {
    Typeface typeface;
    typeface.families = {FamilyOf({{sans, 400, false}}), FamilyOf({{cjk, 400, false}})};
    Layout layout = LayOut(typeface, U16(u"A\u6F22B"));
    ASSERT_EQ(layout.glyphs.size(), 3u);
    EXPECT_EQ(layout.glyphs[0].font, sans.get());
    EXPECT_EQ(layout.glyphs[1].font, cjk.get());
    EXPECT_EQ(layout.glyphs[2].font, sans.get());
    EXPECT_EQ(layout.runs.size(), 3u);

    // The CJK face also has Latin: put first, it takes everything.
    typeface.families = {FamilyOf({{cjk, 400, false}}), FamilyOf({{sans, 400, false}})};
    layout = LayOut(typeface, U16(u"A\u6F22B"));
    ASSERT_EQ(layout.runs.size(), 1u);
    EXPECT_EQ(layout.runs[0].font, cjk);

    // A combining mark stays with its base's font.
    typeface.families = {FamilyOf({{sans, 400, false}}), FamilyOf({{cjk, 400, false}})};
    layout = LayOut(typeface, U16(u"e\u0301"));
    for (const LayoutGlyph& glyph : layout.glyphs) EXPECT_EQ(glyph.font, sans.get());
}

TEST_F(TextLayoutTest, StyleMatchingPicksTheClosestMemberAndFakesTheRest) {
    Typeface typeface;
    typeface.families = {FamilyOf({{sans, 400, false}, {bold, 700, false}})};
    typeface.weight = 700;
    Layout layout = LayOut(typeface, U16(u"A"));
    ASSERT_EQ(layout.runs.size(), 1u);
    EXPECT_EQ(layout.runs[0].font, bold);
    EXPECT_FALSE(layout.runs[0].fakery.bold);

    typeface.families = {FamilyOf({{sans, 400, false}})};
    typeface.italic = true;
    layout = LayOut(typeface, U16(u"A"));
    EXPECT_TRUE(layout.runs[0].fakery.bold);
    EXPECT_TRUE(layout.runs[0].fakery.italic);
    Paint paint;
    paint.skewX = 0.1f;
    RunFont font = ResolveRunFont(paint, layout.runs[0]);
    EXPECT_FLOAT_EQ(font.skewX, 0.1f - 0.25f);
    EXPECT_TRUE(font.embolden);

    typeface.weight = 500;   // not heavy enough to fake
    typeface.italic = false;
    EXPECT_FALSE(LayOut(typeface, U16(u"A")).runs[0].fakery.bold);
}

// Glyph id of one character shaped alone.
uint32_t GlyphOf(const Typeface& typeface, const std::u16string& character) {
    Layout layout = LayOut(typeface, character, Paint(), Bidi::kForceLtr);
    return layout.glyphs.empty() ? 0 : layout.glyphs[0].glyphId;
}

TEST_F(TextLayoutTest, RightToLeftRunsArePlacedInVisualOrder) {
    const uint32_t alef = GlyphOf(regular, u"\u05D0");
    const uint32_t bet = GlyphOf(regular, u"\u05D1");
    const uint32_t a = GlyphOf(regular, u"a");
    // Hebrew first: the paragraph is right to left, the first letter rightmost.
    Layout layout = LayOut(regular, U16(u"\u05D0\u05D1"));
    ASSERT_EQ(layout.glyphs.size(), 2u);
    EXPECT_EQ(layout.glyphs[0].glyphId, bet);
    EXPECT_EQ(layout.glyphs[1].glyphId, alef);
    EXPECT_GT(layout.glyphs[1].x, layout.glyphs[0].x);

    // Latin first: left-to-right paragraph with a reversed Hebrew run.
    layout = LayOut(regular, U16(u"a \u05D0\u05D1"));
    ASSERT_EQ(layout.glyphs.size(), 4u);
    EXPECT_EQ(layout.glyphs[0].glyphId, a);
    EXPECT_EQ(layout.glyphs[2].glyphId, bet);
    EXPECT_EQ(layout.glyphs[3].glyphId, alef);

    // Forced left to right, the letters stay in logical order.
    layout = LayOut(regular, U16(u"\u05D0\u05D1"), Paint(), Bidi::kForceLtr);
    EXPECT_EQ(layout.glyphs[0].glyphId, alef);
}

TEST_F(TextLayoutTest, ContextShapesJoiningLettersAcrossTheRange) {
    // Beh in the middle of three Behs takes its medial form, alone its
    // isolated one: the context decides even when only the middle is laid out.
    std::u16string text = u"\u0628\u0628\u0628";
    Layout middle;
    ASSERT_TRUE(LayoutText(Paint(), Bidi::kDefaultRtl, regular, Units(text), 3, 1, 1, 0, 3, &middle));
    Layout isolated;
    ASSERT_TRUE(LayoutText(Paint(), Bidi::kDefaultRtl, regular, Units(text), 3, 1, 1, 1, 1, &isolated));
    ASSERT_EQ(middle.glyphs.size(), 1u);
    ASSERT_EQ(isolated.glyphs.size(), 1u);
    EXPECT_NE(middle.glyphs[0].glyphId, isolated.glyphs[0].glyphId);
}

// The mask of one laid-out line, drawn as the glyph drawing does.
std::vector<uint8_t> Draw(const Layout& layout, const Paint& paint, int* width, int* height) {
    *width = int(layout.bounds.right - layout.bounds.left) + 2;
    *height = int(layout.bounds.bottom - layout.bounds.top);
    std::vector<uint8_t> mask(size_t(*width) * size_t(*height));
    ForEachFontRun(layout, paint, [&](size_t start, size_t end, const RunFont& font) {
        std::vector<uint16_t> ids;
        std::vector<float> positions;
        for (size_t i = start; i < end; ++i) {
            ids.push_back(uint16_t(layout.glyphs[i].glyphId));
            positions.push_back(layout.glyphs[i].x);
            positions.push_back(layout.glyphs[i].y);
        }
        DrawGlyphs(font, ids.data(), positions.data(), ids.size(), -layout.bounds.left,
                   -layout.bounds.top, mask.data(), *width, *height);
    });
    return mask;
}

long Sum(const std::vector<uint8_t>& mask) { return std::accumulate(mask.begin(), mask.end(), 0L); }

TEST_F(TextLayoutTest, CoverageFillsTheInkBoxAndNothingElse) {
    Paint paint;
    paint.size = 40.0f;
    Layout layout = LayOut(regular, U16(u"H"), paint);
    int width, height;
    std::vector<uint8_t> mask = Draw(layout, paint, &width, &height);
    RunFont font = ResolveRunFont(paint, layout.runs[0]);
    LayoutRect box = GlyphBounds(font, layout.glyphs[0].glyphId);
    ASSERT_FALSE(box.IsEmpty());
    ASSERT_EQ(height, int(box.bottom - box.top));
    int inkRight = -1, fullPixels = 0;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            uint8_t c = mask[size_t(y) * size_t(width) + size_t(x)];
            if (c != 0) inkRight = std::max(inkRight, x);
            fullPixels += c == 255;
        }
    }
    EXPECT_EQ(inkRight, int(box.right - box.left) - 1);
    EXPECT_GT(fullPixels, 100);   // two stems and a bar of a 40 px H
    // The baseline row (the last) is inked: H stands on it.
    long lastRow = 0;
    for (int x = 0; x < width; ++x) lastRow += mask[size_t(height - 1) * size_t(width) + size_t(x)];
    EXPECT_GT(lastRow, 0);

    // Drawing is deterministic to the byte.
    int w2, h2;
    EXPECT_EQ(Draw(layout, paint, &w2, &h2), mask);
}

TEST_F(TextLayoutTest, AliasingEmboldeningAndSlantChangeTheCoverage) {
    Paint paint;
    paint.size = 30.0f;
    Layout layout = LayOut(regular, U16(u"O"), paint);
    int width, height;
    const long plain = Sum(Draw(layout, paint, &width, &height));

    Paint aliased = paint;
    aliased.antiAlias = false;
    for (uint8_t c : Draw(layout, aliased, &width, &height)) ASSERT_TRUE(c == 0 || c == 255);

    Paint bolder = paint;
    bolder.embolden = true;
    EXPECT_GT(Sum(Draw(LayOut(regular, U16(u"O"), bolder), bolder, &width, &height)), plain + plain / 10);

    // A slant that leans right moves the top rows' ink right of the bottom rows'.
    Paint slanted = paint;
    slanted.skewX = -0.5f;
    Layout lean = LayOut(regular, U16(u"l"), slanted);
    std::vector<uint8_t> mask = Draw(lean, slanted, &width, &height);
    auto centre = [&](int row) {
        double mass = 0, moment = 0;
        for (int x = 0; x < width; ++x) {
            mass += mask[size_t(row) * size_t(width) + size_t(x)];
            moment += x * double(mask[size_t(row) * size_t(width) + size_t(x)]);
        }
        return moment / mass;
    };
    EXPECT_GT(centre(1), centre(height - 2) + 5.0);
}

TEST_F(TextLayoutTest, DrawingNeverWritesOutsideTheMask) {
    Paint paint;
    paint.size = 60.0f;
    Layout layout = LayOut(regular, U16(u"Wg"), paint);
    std::vector<uint8_t> guarded(16 + 8 * 8 + 16, 0x5A);
    ForEachFontRun(layout, paint, [&](size_t start, size_t end, const RunFont& font) {
        std::vector<uint16_t> ids;
        std::vector<float> positions;
        for (size_t i = start; i < end; ++i) {
            ids.push_back(uint16_t(layout.glyphs[i].glyphId));
            positions.push_back(layout.glyphs[i].x - 20.0f);
            positions.push_back(layout.glyphs[i].y + 4.0f);
        }
        DrawGlyphs(font, ids.data(), positions.data(), ids.size(), 0.0f, 0.0f, guarded.data() + 16, 8, 8);
    });
    for (int i = 0; i < 16; ++i) EXPECT_EQ(guarded[size_t(i)], 0x5A);
    for (size_t i = 16 + 64; i < guarded.size(); ++i) EXPECT_EQ(guarded[i], 0x5A);
}

TEST_F(TextLayoutTest, ColourStrikesDrawTheirAlphaAsCoverageAtAnySizeAndSlant) {
    std::shared_ptr<Font> emoji = Open(Glimmer::Testing::kNotoColorEmoji);
    ASSERT_NE(emoji, nullptr);
    EXPECT_TRUE(emoji->HasColorGlyphs());
    EXPECT_FALSE(sans->HasColorGlyphs());
    Typeface typeface;
    typeface.families = {FamilyOf({{emoji, 400, false}})};
    int width, height;
    auto maskAt = [&](const Paint& paint) {
        Layout layout = LayOut(typeface, U16(u"\U0001F389"), paint);
        EXPECT_EQ(layout.runs.size(), 1u);
        return Draw(layout, paint, &width, &height);
    };
    Paint paint;
    paint.size = 40.0f;
    const std::vector<uint8_t> mask = maskAt(paint);
    const double plain = double(Sum(mask));
    EXPECT_NEAR(width - 2, 52, 3);   // the image is 1.25 em wide, give or take its filter's reach
    EXPECT_GT(std::count(mask.begin(), mask.end(), uint8_t(255)), 200);   // opaque inside, not a faint copy
    paint.size = 80.0f;
    EXPECT_NEAR(double(Sum(maskAt(paint))), 4.0 * plain, 0.03 * 4.0 * plain);   // coverage grows with the area
    paint.size = 40.0f;
    paint.skewX = -0.5f;
    EXPECT_NEAR(double(Sum(maskAt(paint))), plain, 0.03 * plain);   // a slant keeps the area, widens the box
    EXPECT_GT(width - 2, 52 + 20);
    paint.skewX = 0.0f;
    paint.antiAlias = false;
    for (uint8_t c : maskAt(paint)) ASSERT_TRUE(c == 0 || c == 255);

    // A truncated file, and one whose images are damaged, are no fonts.
    const std::vector<char>& bytes = Bytes(Glimmer::Testing::kNotoColorEmoji);
    EXPECT_EQ(CreateFont(bytes.data(), bytes.size() / 2, 0, FontData::kBorrowed), nullptr);
    std::vector<char> damaged = bytes;
    const size_t tables = size_t(uint8_t(bytes[4])) << 8 | uint8_t(bytes[5]);
    for (size_t t = 0; t < tables; ++t) {
        const char* entry = bytes.data() + 12 + 16 * t;   // tag, checksum, offset, length
        if (std::string(entry, 4) != "CBDT") continue;
        size_t offset = 0, length = 0;
        for (int i = 8; i < 12; ++i) offset = offset << 8 | uint8_t(entry[i]);
        for (int i = 12; i < 16; ++i) length = length << 8 | uint8_t(entry[i]);
        ASSERT_LE(offset + length, damaged.size());
        std::fill(damaged.begin() + long(offset) + 4, damaged.begin() + long(offset + length), '\x5A');
    }
    EXPECT_EQ(CreateFont(damaged.data(), damaged.size(), 0, FontData::kBorrowed), nullptr);
}

TEST_F(TextLayoutTest, EmojiSequencesTakeAColourFontAsOneCluster) {
    std::shared_ptr<Font> emoji = Open(Glimmer::Testing::kNotoColorEmoji);
    ASSERT_NE(emoji, nullptr);
    Typeface typeface;
    typeface.families = {FamilyOf({{sans, 400, false}}), FamilyOf({{emoji, 400, false}})};
    const struct {
        const char16_t* text;
        const char* fonts;   // one per glyph: 's' DejaVu, 'e' the emoji font
    } cases[] = {
        {u"\U0001F44D\U0001F3FD", "e"},         // skin tone
        {u"\U0001F1EB\U0001F1F7", "e"},         // flag
        {u"\U0001F469\u200D\U0001F4BB", "e"},   // ZWJ sequence
        {u"#\uFE0F\u20E3", "e"},                // keycap
        {u"\u2764\uFE0F", "e"},                 // DejaVu has the heart; the selector asks for emoji
        {u"\u2764\uFE0E", "ss"},                // and for text (the selector shapes to a blank)
        {u"A\u2728B", "ses"},                   // emoji by default
        {u"#1", "ss"},                          // keycap bases alone stay text
    };
    for (const auto& c : cases) {
        Layout layout = LayOut(typeface, U16(c.text));
        ASSERT_EQ(layout.glyphs.size(), std::strlen(c.fonts)) << c.fonts;
        for (size_t i = 0; i < layout.glyphs.size(); ++i) {
            EXPECT_EQ(layout.glyphs[i].font, c.fonts[i] == 'e' ? emoji.get() : sans.get()) << c.fonts << " " << i;
            EXPECT_NE(layout.glyphs[i].glyphId, 0u) << c.fonts << " " << i;
        }
    }
}

TEST_F(TextLayoutTest, CharactersNoFamilyHasComeFromTheSystemsFonts) {
    Typeface typeface = regular;
    typeface.systemFallback = true;
    const struct {
        const char16_t* text;
        const char* family;
    } cases[] = {
        {u"\u0710\u0712", "Noto Sans Syriac"},
        {u"\uA9B2\uA98F", "Noto Sans Javanese"},
        {u"\U0001F389", "Noto Color Emoji"},
        {u"ab", "DejaVu Sans"},
    };
    for (const auto& c : cases) {
        Layout layout = LayOut(typeface, U16(c.text));
        ASSERT_FALSE(layout.glyphs.empty()) << c.family;
        for (const LayoutGlyph& glyph : layout.glyphs) {
            EXPECT_STREQ(glyph.font->FamilyName(), c.family);
            EXPECT_NE(glyph.glyphId, 0u);
        }
    }
    // A character no installed font has is the first family's missing glyph;
    // so is every character a typeface without the system's fonts lacks.
    for (const Typeface* t : {&typeface, &regular}) {
        Layout missing = LayOut(*t, U16(t == &regular ? u"\u0710" : u"\u0378"));
        ASSERT_EQ(missing.glyphs.size(), 1u);
        EXPECT_EQ(missing.glyphs[0].font, sans.get());
        EXPECT_EQ(missing.glyphs[0].glyphId, 0u);
    }
    EXPECT_EQ(SystemFallbackFont(0x0710, false), SystemFallbackFont(0x0712, false));   // loaded once
    EXPECT_EQ(SystemFallbackFont(0x0378, false), nullptr);
}

}  // namespace
}  // namespace Glimmer::Platform
