// The platform seam's layout and glyph drawing: which font each character
// gets, refusals, and the bounds of drawing. How the glyphs look (shaping,
// direction, slant, aliasing, colour glyphs) is pinned by the picture table.

#include <gtest/gtest.h>

#include <array>
#include <cstring>
#include <limits>
#include <map>
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
    static auto* files = new std::map<std::string, std::vector<char>>();
    return files->try_emplace(path, ReadFile(path)).first->second;
}

std::shared_ptr<Font> Open(const char* path, int index = 0) {
    const std::vector<char>& bytes = Bytes(path);
    return CreateFont(bytes.data(), bytes.size(), index, FontData::kBorrowed);
}

std::shared_ptr<FontFamily> FamilyOf(std::vector<FontFamily::Member> members) {
    return std::make_shared<FontFamily>(0u, 0, std::move(members));
}

const uint16_t* Units(const std::u16string& text) { return reinterpret_cast<const uint16_t*>(text.data()); }

Layout LayOut(const Typeface& typeface, const std::u16string& text, Paint paint = Paint()) {
    Layout layout;
    EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, typeface, Units(text), text.size(), 0, text.size(), 0,
                           text.size(), &layout));
    return layout;
}

class TextLayoutTest : public ::testing::Test {
protected:
    void SetUp() override {
        sans = Open(Glimmer::Testing::kDejaVuSans);
        cjk = Open(Glimmer::Testing::kNotoCjk, 2);
        emoji = Open(Glimmer::Testing::kNotoColorEmoji);
        ASSERT_TRUE(sans && cjk && emoji) << "a font of fonts-dejavu-core or fonts-noto-* is missing";
        regular.families = {FamilyOf({{sans, 400, false}})};
    }

    std::shared_ptr<Font> sans, cjk, emoji;
    Typeface regular;
};

TEST_F(TextLayoutTest, FontsAreMadeOnlyOfReadableFacesInRange) {
    const std::vector<char>& bytes = Bytes(Glimmer::Testing::kDejaVuSans);
    std::vector<char> noise(4096);
    std::mt19937 random(7);
    for (char& c : noise) c = char(random());
    // A colour font whose images are damaged is no font either.
    const std::vector<char>& colour = Bytes(Glimmer::Testing::kNotoColorEmoji);
    std::vector<char> damaged = colour;
    auto u32 = [&](size_t at) { return size_t(uint8_t(colour[at])) << 24 | size_t(uint8_t(colour[at + 1])) << 16 |
                                       size_t(uint8_t(colour[at + 2])) << 8 | uint8_t(colour[at + 3]); };
    for (size_t entry = 12; entry < 12 + 16 * (u32(4) >> 16); entry += 16) {   // tag, checksum, offset, length
        if (std::string(&colour[entry], 4) != "CBDT") continue;
        ASSERT_LE(u32(entry + 8) + u32(entry + 12), damaged.size());
        std::fill(damaged.begin() + long(u32(entry + 8)) + 4, damaged.begin() + long(u32(entry + 8) + u32(entry + 12)), '\x5A');
    }
    const struct {
        const char* what;
        const char* data;
        size_t size;
        int index;
    } refused[] = {
        {"no bytes", nullptr, 100, 0},
        {"empty", bytes.data(), 0, 0},
        {"index -1", bytes.data(), bytes.size(), -1},
        {"index 1 of one face", bytes.data(), bytes.size(), 1},
        {"index 0x10000", bytes.data(), bytes.size(), 0x10000},
        {"noise", noise.data(), noise.size(), 0},
        {"truncated colour font", colour.data(), colour.size() / 2, 0},
        {"damaged colour images", damaged.data(), damaged.size(), 0},
    };
    for (const auto& c : refused) EXPECT_EQ(CreateFont(c.data, c.size, c.index, FontData::kBorrowed), nullptr) << c.what;

    EXPECT_FALSE(sans->HasGlyph(0x6F22));
    EXPECT_TRUE(emoji->HasColorGlyphs());
    EXPECT_FALSE(sans->HasColorGlyphs());
    // Faces of one collection are told apart by index.
    EXPECT_STREQ(cjk->FamilyName(), "Noto Sans CJK SC");
    EXPECT_STREQ(Open(Glimmer::Testing::kNotoCjk, 0)->FamilyName(), "Noto Sans CJK JP");
}

TEST_F(TextLayoutTest, BadRangesAndEmptyInputsGiveEmptyLayouts) {
    const std::u16string text = u"abc";
    Paint paint;
    Layout layout;
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 1, 1, 2, 1, &layout));   // outside the context
    EXPECT_FALSE(LayoutText(paint, Bidi::kDefaultLtr, regular, nullptr, 3, 0, 3, 0, 3, &layout));
    EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, Typeface(), Units(text), 3, 0, 3, 0, 3, &layout));
    EXPECT_TRUE(layout.glyphs.empty());
    for (float size : {0.0f, -5.0f, 1.0e30f, std::numeric_limits<float>::quiet_NaN()}) {
        paint.size = size;
        EXPECT_TRUE(LayoutText(paint, Bidi::kDefaultLtr, regular, Units(text), 3, 0, 3, 0, 3, &layout));
        EXPECT_TRUE(layout.glyphs.empty()) << size;
        EXPECT_EQ(layout.advance, 0.0f) << size;
    }
}

// Each character takes the first family that has it (a combining mark its
// base's), and in the family the member closest in style; the rest is faked.
TEST_F(TextLayoutTest, FontsAreChosenByFamilyOrderThenByStyle) {
    Typeface typeface;
    typeface.families = {FamilyOf({{sans, 400, false}}), FamilyOf({{cjk, 400, false}})};
    std::vector<const Font*> fonts;
    for (const LayoutGlyph& glyph : LayOut(typeface, u"A\u6F22Be\u0301").glyphs) fonts.push_back(glyph.font);
    EXPECT_EQ(fonts, (std::vector<const Font*>{sans.get(), cjk.get(), sans.get(), sans.get()}))
        << "A, Han, B and e + acute (one glyph) should come from DejaVu, the CJK face, DejaVu, DejaVu";
    typeface.families = {FamilyOf({{cjk, 400, false}}), FamilyOf({{sans, 400, false}})};
    EXPECT_EQ(LayOut(typeface, u"A\u6F22B").runs.size(), 1u);   // the CJK face also has Latin

    std::shared_ptr<Font> bold = Open(Glimmer::Testing::kDejaVuSansBold);
    typeface.families = {FamilyOf({{sans, 400, false}, {bold, 700, false}})};
    typeface.weight = 700;
    Layout layout = LayOut(typeface, u"A");
    EXPECT_EQ(layout.runs.at(0).font, bold);
    EXPECT_FALSE(layout.runs[0].fakery.bold);
    typeface.families = {FamilyOf({{sans, 400, false}})};
    typeface.italic = true;
    layout = LayOut(typeface, u"A");
    Paint paint;
    paint.skewX = 0.1f;
    const RunFont font = ResolveRunFont(paint, layout.runs.at(0));
    EXPECT_FLOAT_EQ(font.skewX, 0.1f - 0.25f);   // fake italic leans by a quarter
    EXPECT_TRUE(font.embolden);
    typeface.weight = 500;   // not heavy enough to fake
    EXPECT_FALSE(LayOut(typeface, u"A").runs.at(0).fakery.bold);
}

TEST_F(TextLayoutTest, DrawingNeverWritesOutsideTheMask) {
    Paint paint;
    paint.size = 60.0f;
    const Layout layout = LayOut(regular, u"Wg", paint);
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
    EXPECT_EQ(std::vector<uint8_t>(guarded.begin(), guarded.begin() + 16), std::vector<uint8_t>(16, 0x5A));
    EXPECT_EQ(std::vector<uint8_t>(guarded.end() - 16, guarded.end()), std::vector<uint8_t>(16, 0x5A));
}

TEST_F(TextLayoutTest, EmojiSequencesTakeAColourFontAsOneCluster) {
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
        const Layout layout = LayOut(typeface, c.text);
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
        const Layout layout = LayOut(typeface, c.text);
        ASSERT_FALSE(layout.glyphs.empty()) << c.family;
        for (const LayoutGlyph& glyph : layout.glyphs) {
            EXPECT_STREQ(glyph.font->FamilyName(), c.family);
            EXPECT_NE(glyph.glyphId, 0u) << c.family;
        }
    }
    // A character no installed font has is the first family's missing glyph;
    // so is every character a typeface without the system's fonts lacks.
    for (const Typeface* t : {&typeface, &regular}) {
        const Layout missing = LayOut(*t, t == &regular ? u"\u0710" : u"\u0378");
        ASSERT_EQ(missing.glyphs.size(), 1u);
        EXPECT_EQ(missing.glyphs[0].font, sans.get());
        EXPECT_EQ(missing.glyphs[0].glyphId, 0u);
    }
    EXPECT_EQ(SystemFallbackFont(0x0710, false), SystemFallbackFont(0x0712, false));   // loaded once
    EXPECT_EQ(SystemFallbackFont(0x0378, false), nullptr);
}

}  // namespace
}  // namespace Glimmer::Platform
