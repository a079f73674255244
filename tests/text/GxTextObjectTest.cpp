#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/Error.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "platform/TextLayout.h"
#include "support/LogCapture.h"
#include "text/GxFontDrawing.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

using Testing::LogCapture;

TEST(GxTextObjectTest, AnUnconstructedObjectFailsWithCodeEight) {
    LogCapture log;
    {
        GxTextObject text;
        Error::SetError(0);
        EXPECT_EQ(text.GetEffect(), nullptr);
        EXPECT_EQ(Error::GetError(), 8);
        EXPECT_EQ(text.GetRuntimeHandle(), -1);
        EXPECT_EQ(text.GetTextColor(), 0xFF000000u);
        EXPECT_FALSE(text.SetText(L"x"));
        EXPECT_FALSE(text.SetFont("/no/such/font.ttf"));
        EXPECT_EQ(text.RenderTextEffect(10, 10), nullptr);
        EXPECT_EQ(text.GetPaint().size, Platform::Paint().size);
        EXPECT_EQ(log.CountErrors("GxTextObject", 8), 7);
    }
    EXPECT_EQ(log.CountErrors("GxTextObject", 8), 8);   // the destructor too
}

TEST(GxTextObjectTest, ASecondConstructFailsAndKeepsTheHandle) {
    GxTextObject text;
    ASSERT_TRUE(text.Construct());
    const int handle = text.GetRuntimeHandle();
    EXPECT_GT(handle, 0);
    EXPECT_EQ(GxTextObject::FindGxTextObject(handle), &text);
    EXPECT_FALSE(text.Construct());
    EXPECT_EQ(Error::GetError(), 4);
    EXPECT_EQ(text.GetRuntimeHandle(), handle);
}

TEST(GxTextObjectTest, SettersCheckTheirArguments) {
    GxTextObject text;
    ASSERT_TRUE(text.Construct());
    LogCapture log;
    EXPECT_TRUE(text.SetText(L"abc"));
    ASSERT_NE(text.GetText(), nullptr);
    EXPECT_EQ(text.GetText()->GetLength(), 3);
    EXPECT_TRUE(text.SetText(static_cast<const wchar_t*>(nullptr)));
    EXPECT_EQ(text.GetText(), nullptr);

    EXPECT_FALSE(text.SetLineInfo(nullptr));
    EXPECT_EQ(Error::GetError(), 7);
    EXPECT_EQ(log.Count("GxTextObject", "SetLineInfo - lineInfo is NULL"), 1);
    EXPECT_FALSE(text.SetFont(nullptr));
    EXPECT_EQ(Error::GetError(), 7);
    EXPECT_FALSE(text.SetFont("/no/such/font.ttf"));
    EXPECT_EQ(text.GetFont()->GetFontPath(), nullptr);   // a failed font is not taken

    GxView* view = text.GetView();
    ASSERT_TRUE(view->SetBitmapWidth(40));
    EXPECT_FALSE(view->SetBitmapWidth(-1));
    EXPECT_EQ(view->GetBitmapWidth(), 40);
    EXPECT_EQ(log.Count("GxView", "SetBitmapWidht() - width[-1] is invalid"), 1);
    EXPECT_TRUE(view->SetBitmapWidth(0));
    EXPECT_FALSE(view->SetBitmapHeight(-2));
    EXPECT_EQ(log.Count("GxView", "SetBitmapHeight() - height[-2] is invalid"), 1);
    EXPECT_FALSE(view->SetSize(3, -1));
    EXPECT_EQ(log.Count("GxView", "SetSize() - size invalid"), 1);
    EXPECT_EQ(view->GetHeight(), 0);
    EXPECT_EQ(view->GetDrawingBitmapSize()[0], 0);
}

// Which system families are loaded, in configuration order.
std::vector<int> BuiltFlags() {
    std::vector<int> flags;
    const List* families = FontManager::GetInstance()->GetSystemFontFamilies();
    for (int i = 0; families != nullptr && i < families->GetCount(); ++i) {
        flags.push_back(static_cast<GxFontFamily*>(families->Get(i))->built);
    }
    return flags;
}

bool FamilyBuilt(const char* languages) {
    const uint32_t id = Platform::RegisterLocaleList(languages);
    const List* families = FontManager::GetInstance()->GetSystemFontFamilies();
    for (int i = 0; families != nullptr && i < families->GetCount(); ++i) {
        auto* family = static_cast<GxFontFamily*>(families->Get(i));
        if (family->localeListId == id && family->built != 0) return true;
    }
    return false;
}

TEST(GxTextObjectTest, SettingATextLoadsTheFamiliesOfItsScripts) {
    GxTextObject text;
    ASSERT_TRUE(text.Construct());
    const std::vector<int> before = BuiltFlags();
    ASSERT_TRUE(text.SetText(L"Latin, digits 123 and punctuation!? \u0301"));
    EXPECT_EQ(BuiltFlags(), before);

    ASSERT_TRUE(text.SetText(L"\u6F22\u5B57"));
    EXPECT_TRUE(FamilyBuilt("zh-Hans"));
    EXPECT_TRUE(FamilyBuilt("zh-Hant"));
    ASSERT_TRUE(text.SetText(L"abc \u3042"));   // a kana after Latin
    EXPECT_TRUE(FamilyBuilt("ja"));
    ASSERT_TRUE(text.SetText(L"\uD55C"));
    EXPECT_TRUE(FamilyBuilt("ko"));
    ASSERT_TRUE(text.SetText(L"(\u0633\u0644\u0627\u0645)"));
    EXPECT_TRUE(FamilyBuilt("und-Arab"));
}

// A text object with DejaVu Sans, a paint of `size` pixels and one line
// record per (start, end, x, baseline).
class RenderTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(text.Construct());
        ASSERT_TRUE(text.SetFont(Testing::kDejaVuSans));
    }

    void Prepare(const wchar_t* string, float size, unsigned color = 0xFFFF0000u) {
        ASSERT_TRUE(text.SetText(string));
        Platform::Paint paint;
        paint.size = size;
        text.SetPaint(paint);
        text.SetTextColor(color);
    }

    void AddLine(int start, int end, int x, int baseline, int ascent, int descent, int width) {
        auto* line = new GxLineInfo();
        line->x = x;
        line->baseline = baseline;
        line->start = start;
        line->end = end;
        line->bounds = GxRect(x, baseline + ascent, x + width, baseline + descent);
        pending.push_back(line);
    }

    void HandOverLines() {
        List lines;
        lines.Construct();
        for (GxLineInfo* line : pending) lines.Add(line);
        ASSERT_TRUE(text.SetLineInfo(&lines));
        pending.clear();
    }

    // Renders the view plus the effects' margins, as the bridge does.
    const unsigned* Render(int viewWidth, int viewHeight) {
        GxEffect* effect = text.GetEffect();
        width = viewWidth + effect->getLeftOffset() + effect->getRightOffset();
        height = viewHeight + effect->getTopOffset() + effect->getBottomOffset();
        text.GetView()->SetSize(viewWidth, viewHeight);
        text.GetView()->SetBitmapWidth(width);
        text.GetView()->SetBitmapHeight(height);
        pixels = text.RenderTextEffect(width, height);
        return pixels;
    }

    unsigned At(int x, int y) const { return pixels[size_t(y) * size_t(width) + size_t(x)]; }
    static int Alpha(unsigned p) { return int(p >> 24); }
    static int Red(unsigned p) { return int(p >> 16 & 0xFF); }
    static int Green(unsigned p) { return int(p >> 8 & 0xFF); }
    static int Blue(unsigned p) { return int(p & 0xFF); }

    GxLineInfo* Line(int i) { return static_cast<GxLineInfo*>(text.GetLineInfo()->Get(i)); }

    GxTextObject text;
    std::vector<GxLineInfo*> pending;
    const unsigned* pixels = nullptr;
    int width = 0;
    int height = 0;
};

struct Box {
    int left = INT_MAX, top = INT_MAX, right = INT_MIN, bottom = INT_MIN;   // inclusive
    void Add(int x, int y) {
        left = std::min(left, x);
        top = std::min(top, y);
        right = std::max(right, x);
        bottom = std::max(bottom, y);
    }
    bool Empty() const { return left > right; }
};

TEST_F(RenderTest, HelloHasCoverageAtItsGlyphsAndEffectsInTheMargins) {
    Prepare(L"Hello", 48.0f);
    GxEffect* effect = text.GetEffect();
    ASSERT_GE(effect->addStrokeText(4.0f, 0xFF0000FFu, 1.0f, 0, 1), 0);          // blue, outside
    ASSERT_GE(effect->addOuterShadowText(90.0f, 6.0f, 4.0f, 0xFF000000u, 1.0f), 0);  // down
    ASSERT_EQ(effect->getLeftOffset(), 4);
    ASSERT_EQ(effect->getTopOffset(), 4);
    ASSERT_EQ(effect->getBottomOffset(), 10);
    AddLine(0, 5, 10, 60, -45, 12, 130);
    HandOverLines();
    ASSERT_NE(Render(300, 100), nullptr);

    // The glyphs: opaque red, inside the line's place (pen 14, baseline 64).
    Box glyphs, ink;
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            unsigned p = At(x, y);
            if (Alpha(p) != 0) ink.Add(x, y);
            if (Alpha(p) == 255 && Red(p) > 240 && Green(p) < 16 && Blue(p) < 16) glyphs.Add(x, y);
        }
    }
    ASSERT_FALSE(glyphs.Empty());
    EXPECT_GE(glyphs.left, 14);
    EXPECT_LE(glyphs.right, 14 + 130);
    EXPECT_GE(glyphs.top, 64 - 40);
    EXPECT_LE(glyphs.bottom, 63);   // "Hello" stands on the baseline

    // The stroke and the shadow reach past the glyphs, by their sizes and no further.
    EXPECT_LT(ink.left, glyphs.left);
    EXPECT_GE(ink.left, glyphs.left - 5);
    EXPECT_GT(ink.right, glyphs.right);
    EXPECT_LE(ink.right, glyphs.right + 5);
    EXPECT_LT(ink.top, glyphs.top);
    EXPECT_GE(ink.top, glyphs.top - 5);
    EXPECT_GT(ink.bottom, glyphs.bottom + 5);   // only the shadow gets this low
    EXPECT_LE(ink.bottom, glyphs.bottom + 11);
    int blue = 0;
    for (int y = ink.top; y <= ink.bottom; ++y) {
        for (int x = ink.left; x <= ink.right; ++x) blue += Blue(At(x, y)) > 200 && Red(At(x, y)) < 60;
    }
    EXPECT_GT(blue, 200);
    EXPECT_EQ(Alpha(At(0, 0)), 0);
    EXPECT_EQ(Alpha(At(width - 1, height - 1)), 0);
}

// Layer-style rendering keeps an inside stroke inside the glyphs (the exact
// mode paints the whole text box with it) and fades only the fill.
TEST_F(RenderTest, LayerStyleKeepsInnerEffectsInsideAndFadesOnlyTheFill) {
    Prepare(L"H", 48.0f);
    AddLine(0, 1, 10, 60, -45, 12, 60);
    HandOverLines();
    GxEffect* effect = text.GetEffect();
    struct Picture {
        std::vector<unsigned> pixels;
        int width, left, top;   // the view's corner sits at (left, top)
    };
    auto render = [&](bool layerStyle, float fillOpacity, int strokePosition) {
        effect->cleanAllEffect();
        effect->setLayerStyle(layerStyle);
        effect->setTextOpacity(fillOpacity);
        if (strokePosition >= 0) effect->addStrokeText(3.0f, 0xFFFFD000u, 1.0f, 0, strokePosition);
        const int left = effect->getLeftOffset(), top = effect->getTopOffset();
        EXPECT_NE(Render(80, 80), nullptr);
        return Picture{std::vector<unsigned>(pixels, pixels + size_t(width) * size_t(height)), width, left, top};
    };
    const Picture plain = render(false, 1.0f, -1);
    // Painted pixels of `p` whose glyph coverage (alpha of the plain text) passes `where`.
    auto count = [&](const Picture& p, auto where) {
        int n = 0;
        for (int y = 0; y < 80; ++y) {
            for (int x = 0; x < 80; ++x) {
                const unsigned painted = p.pixels[size_t(y + p.top) * p.width + size_t(x + p.left)];
                n += Alpha(painted) != 0 && where(Alpha(plain.pixels[size_t(y) * plain.width + size_t(x)]));
            }
        }
        return n;
    };
    auto outsideGlyphs = [](int coverage) { return coverage == 0; };
    auto deepInside = [](int coverage) { return coverage == 255; };
    EXPECT_GT(count(render(false, 1.0f, 2), outsideGlyphs), 100);  // between the bars of the H
    EXPECT_EQ(count(render(true, 1.0f, 2), outsideGlyphs), 0);
    // Fill opacity 0: an outline, nothing inside it.
    const Picture outline = render(true, 0.0f, 1);
    EXPECT_EQ(count(outline, deepInside), 0);
    EXPECT_GT(count(outline, outsideGlyphs), 100);
    EXPECT_EQ(count(render(false, 0.0f, 1), deepInside), count(plain, deepInside));  // exact: opaque
}

TEST_F(RenderTest, LinesArePlacedAtTheirBaselines) {
    Prepare(L"HH\nHH", 32.0f, 0xFF000000u);
    AddLine(0, 2, 5, 40, -30, 8, 50);
    AddLine(3, 5, 17, 100, -30, 8, 50);
    HandOverLines();
    ASSERT_NE(Render(200, 130), nullptr);
    struct Expect {
        int x, baseline, from, to;   // rows [from, to) hold this line
    } lines[] = {{5, 40, 0, 70}, {17, 100, 70, 130}};
    for (const Expect& line : lines) {
        Box ink;
        for (int y = line.from; y < line.to; ++y) {
            for (int x = 0; x < width; ++x) {
                if (Alpha(At(x, y)) != 0) ink.Add(x, y);
            }
        }
        ASSERT_FALSE(ink.Empty());
        EXPECT_EQ(ink.bottom, line.baseline - 1);       // H stands on the baseline
        EXPECT_NEAR(ink.top, line.baseline - 24, 1);     // cap height of a 32 px H
        EXPECT_EQ(ink.left, line.x);                     // the mask starts at the ink
    }
}

TEST_F(RenderTest, TheClipKeepsThePaddingOnlyOnTheGravitatedSide) {
    Prepare(L"HHHHHHHHHH", 32.0f, 0x00000000u);   // a text alpha of 0 leaves the background alone
    text.SetBackgroundColor(0xFF20C040u, true);
    AddLine(0, 10, 0, 45, -45, 5, 100);
    HandOverLines();
    GxView* view = text.GetView();
    view->SetPadding(10, 10, 10, 10);

    view->gravity = GxView::kGravityLeft | GxView::kGravityTop;
    ASSERT_NE(Render(100, 50), nullptr);
    EXPECT_EQ(At(0, 0), 0xFF20C040u);
    EXPECT_EQ(At(89, 39), 0xFF20C040u);
    EXPECT_EQ(At(90, 20), 0u);
    EXPECT_EQ(At(20, 40), 0u);

    view->gravity = GxView::kGravityRight | GxView::kGravityBottom;
    ASSERT_NE(Render(100, 50), nullptr);
    EXPECT_EQ(At(99, 49), 0xFF20C040u);
    EXPECT_EQ(At(10, 10), 0xFF20C040u);
    EXPECT_EQ(At(9, 20), 0u);
    EXPECT_EQ(At(20, 9), 0u);

    // Opaque text over the box: its own colour and the box's, never either
    // with red and blue exchanged.
    text.SetTextColor(0xFFE05010u);
    ASSERT_NE(Render(100, 50), nullptr);
    const std::vector<unsigned> all(pixels, pixels + size_t(width) * size_t(height));
    EXPECT_GT(std::count(all.begin(), all.end(), 0xFFE05010u), 0);
    EXPECT_GT(std::count(all.begin(), all.end(), 0xFF20C040u), 0);
    EXPECT_EQ(std::count(all.begin(), all.end(), 0xFF1050E0u) + std::count(all.begin(), all.end(), 0xFF40C020u), 0);
}

TEST_F(RenderTest, EveryRenderMovesTheBackgroundBoxesAndReplacesThePixels) {
    Prepare(L"Hi", 24.0f);
    ASSERT_GE(text.GetEffect()->addStrokeText(3.0f, 0xFF0000FFu, 1.0f, 0, 1), 0);
    AddLine(0, 2, 0, 30, -25, 6, 40);
    HandOverLines();
    const unsigned* first = Render(60, 40);
    ASSERT_NE(first, nullptr);
    const std::vector<unsigned> firstPixels(first, first + size_t(width) * size_t(height));
    EXPECT_EQ(Line(0)->bounds.left, 3);
    EXPECT_EQ(Line(0)->bounds.top, 30 - 25 + 3);
    EXPECT_EQ(Line(0)->bounds.bottom, 30 + 6 + 3);
    const unsigned* second = Render(60, 40);
    EXPECT_NE(second, first);   // a new buffer; the first one is gone
    EXPECT_EQ(Line(0)->bounds.top, 30 - 25 + 6);
    EXPECT_EQ(Line(0)->bounds.bottom, 30 + 6 + 6);
    EXPECT_TRUE(std::equal(firstPixels.begin(), firstPixels.end(), second));
}

TEST_F(RenderTest, MissingTextOrLinesGiveATransparentPicture) {
    LogCapture log;
    Prepare(L"", 20.0f);
    const unsigned* empty = Render(20, 10);
    ASSERT_NE(empty, nullptr);
    EXPECT_TRUE(std::all_of(empty, empty + 200, [](unsigned p) { return p == 0; }));
    char expected[64];
    std::snprintf(expected, sizeof expected, "DrawTextEffect(%p) - textLength is 0", static_cast<void*>(&text));
    EXPECT_EQ(log.Count("GxFontDrawing", expected), 1);

    ASSERT_TRUE(text.SetText(static_cast<const wchar_t*>(nullptr)));
    ASSERT_NE(Render(20, 10), nullptr);
    std::snprintf(expected, sizeof expected, "DrawTextEffect(%p) - text is NULL", static_cast<void*>(&text));
    EXPECT_EQ(log.Count("GxFontDrawing", expected), 1);

    Prepare(L"abc", 20.0f);   // a text but no line records
    const unsigned* none = Render(20, 10);
    ASSERT_NE(none, nullptr);
    EXPECT_TRUE(std::all_of(none, none + 200, [](unsigned p) { return p == 0; }));
    EXPECT_EQ(text.RenderTextEffect(-1, 5), nullptr);
    EXPECT_EQ(Error::GetError(), 7);
}

TEST_F(RenderTest, ALineOutsideTheTextIsRefusedAndTheLastPictureKept) {
    Prepare(L"abc", 20.0f);
    AddLine(0, 3, 0, 20, -16, 4, 40);
    HandOverLines();
    const unsigned* good = Render(40, 30);
    ASSERT_NE(good, nullptr);
    const std::vector<unsigned> kept(good, good + size_t(width) * size_t(height));
    LogCapture log;
    for (auto range : {std::pair{1, 4}, std::pair{2, 1}, std::pair{-1, 2}}) {
        AddLine(0, 3, 0, 20, -16, 4, 40);
        AddLine(range.first, range.second, 0, 40, -16, 4, 40);
        HandOverLines();
        Error::SetError(0);
        EXPECT_EQ(Render(40, 30), nullptr);
        EXPECT_EQ(Error::GetError(), 7);
        char expected[96];
        std::snprintf(expected, sizeof expected, "RenderTextEffect(%p) - line 1 [%d, %d) lies outside the text of 3 units",
                      static_cast<void*>(&text), range.first, range.second);
        EXPECT_EQ(log.Count("GxTextObject", expected), 1);
    }
    EXPECT_TRUE(std::equal(kept.begin(), kept.end(), good));   // the last picture is still there
}

TEST_F(RenderTest, APictureTooLargeToHoldIsRefusedBeforeAnythingIsDrawn) {
    LogCapture log;
    Prepare(L"", 20.0f);   // drawing would log that the text is empty
    const unsigned* before = Render(20, 10);
    ASSERT_NE(before, nullptr);
    log.Clear();
    Error::SetError(0);
    EXPECT_EQ(text.RenderTextEffect(30000, 30000), nullptr);
    EXPECT_EQ(Error::GetError(), 7);
    EXPECT_STRNE(Error::GetReason(), "");
    for (const Testing::LogLine& line : log.Lines()) EXPECT_NE(line.tag, "GxFontDrawing") << line.message;
    EXPECT_NE(Render(20, 10), nullptr);
}

TEST_F(RenderTest, FallbackFamiliesDrawTheScriptsTheFontLacks) {
    GxTextObject plain;   // no font of its own: only the system's families
    ASSERT_TRUE(plain.Construct());
    ASSERT_TRUE(plain.SetText(L"\u6F22\u5B57 \u0633\u0644\u0627\u0645"));

    Platform::FontFamilies families;
    int weight = 400;
    ASSERT_TRUE(FontManager::GetInstance()->GetMinikinFontFamilies(families, nullptr, &weight));
    auto typeface = Platform::CreateTypefaceFromFamilies(families, weight, false);
    auto fontOf = [&](const char16_t* character) {
        Platform::Layout layout;
        Platform::LayoutText(Platform::Paint(), Platform::Bidi::kDefaultLtr, *typeface,
                             reinterpret_cast<const uint16_t*>(character), 1, 0, 1, 0, 1, &layout);
        return layout.glyphs.empty() ? nullptr : layout.glyphs[0].font;
    };
    // The family of a locale list, and whether `font` is one of its members.
    auto inFamily = [&](const Platform::Font* font, const char* languages) {
        const uint32_t id = Platform::RegisterLocaleList(languages);
        for (const auto& family : families) {
            if (family->localeListId != id) continue;
            for (const auto& member : family->fonts) {
                if (member.font.get() == font) return true;
            }
        }
        return false;
    };
    const Platform::Font* han = fontOf(u"\u6F22");
    const Platform::Font* arabic = fontOf(u"\u0633");
    ASSERT_NE(han, nullptr);
    ASSERT_NE(arabic, nullptr);
    EXPECT_TRUE(inFamily(han, "zh-Hans"));
    EXPECT_TRUE(inFamily(arabic, "und-Arab"));
    EXPECT_TRUE(han->HasGlyph(0x6F22));
    EXPECT_TRUE(arabic->HasGlyph(0x0633));

    // And the Han text draws through them.
    Prepare(L"\u6F22\u5B57", 40.0f, 0xFF000000u);
    AddLine(0, 2, 0, 45, -40, 10, 80);
    HandOverLines();
    ASSERT_NE(Render(100, 60), nullptr);
    int inked = 0;
    for (int i = 0; i < width * height; ++i) inked += Alpha(pixels[i]) == 255;
    EXPECT_GT(inked, 300);
}

}  // namespace
}  // namespace Glimmer
