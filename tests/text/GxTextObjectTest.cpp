// The text object's own rules: two-phase construction, argument checks, the
// families a text loads, and what a render refuses or keeps. Whole renders
// through the public path are pinned by the picture table.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <utility>
#include <vector>

#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/Error.h"
#include "foundation/List.h"
#include "platform/LocaleList.h"
#include "support/LogCapture.h"
#include "text/GxFontDrawing.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/GxView.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

using Testing::CodeOf;
using Testing::LogCapture;

TEST(GxTextObjectTest, UnconstructedFailsWithCode8AndASecondConstructWithCode4) {
    LogCapture log;
    {
        GxTextObject text;
        EXPECT_EQ(CodeOf([&] { EXPECT_EQ(text.GetEffect(), nullptr); }), 8);
        EXPECT_FALSE(text.SetText(L"x"));
        EXPECT_EQ(text.RenderTextEffect(10, 10), nullptr);
        EXPECT_EQ(text.GetRuntimeHandle(), -1);
        EXPECT_EQ(log.CountErrors("GxTextObject", 8), 4);
    }
    EXPECT_EQ(log.CountErrors("GxTextObject", 8), 5);   // the destructor too

    GxTextObject text;
    ASSERT_TRUE(text.Construct());
    const int handle = text.GetRuntimeHandle();
    EXPECT_EQ(GxTextObject::FindGxTextObject(handle), &text);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(text.Construct()); }), 4);
    EXPECT_EQ(text.GetRuntimeHandle(), handle);
}

TEST(GxTextObjectTest, SettersRefuseBadArgumentsAndKeepWhatTheyHad) {
    GxTextObject text;
    ASSERT_TRUE(text.Construct());
    LogCapture log;
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(text.SetLineInfo(nullptr)); }), 7);
    EXPECT_EQ(log.Count("GxTextObject", "SetLineInfo - lineInfo is NULL"), 1);
    EXPECT_EQ(CodeOf([&] { EXPECT_FALSE(text.SetFont(nullptr)); }), 7);
    EXPECT_FALSE(text.SetFont("/no/such/font.ttf"));
    EXPECT_EQ(text.GetFont()->GetFontPath(), nullptr);   // a failed font is not taken

    GxView* view = text.GetView();
    ASSERT_TRUE(view->SetBitmapWidth(40));
    EXPECT_FALSE(view->SetBitmapWidth(-1));
    EXPECT_EQ(view->GetBitmapWidth(), 40);
    EXPECT_EQ(log.Count("GxView", "SetBitmapWidht() - width[-1] is invalid"), 1);
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
    const std::pair<const wchar_t*, const char*> cases[] = {
        {L"\u6F22\u5B57", "zh-Hans"}, {L"\u6F22", "zh-Hant"},      {L"abc \u3042", "ja"},   // a kana after Latin
        {L"\uD55C", "ko"},            {L"(\u0633\u0644\u0627\u0645)", "und-Arab"},
    };
    for (const auto& [string, languages] : cases) {
        ASSERT_TRUE(text.SetText(string));
        EXPECT_TRUE(FamilyBuilt(languages)) << languages;
    }
}

// A text object with DejaVu Sans, "abc" in red at 20 pixels.
class RenderTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(text.Construct());
        ASSERT_TRUE(text.SetFont(Testing::kDejaVuSans));
        Prepare(L"abc");
    }

    void Prepare(const wchar_t* string) {
        ASSERT_TRUE(text.SetText(string));
        Platform::Paint paint;
        paint.size = 20.0f;
        text.SetPaint(paint);
        text.SetTextColor(0xFFFF0000u);
    }

    void SetLines(std::vector<std::pair<int, int>> ranges) {
        List lines;
        lines.Construct();
        for (auto [start, end] : ranges) {
            auto* line = new GxLineInfo();
            line->start = start;
            line->end = end;
            line->baseline = 20 * lines.GetCount() + 20;
            line->bounds = GxRect(0, line->baseline - 16, 40, line->baseline + 4);
            lines.Add(line);
        }
        ASSERT_TRUE(text.SetLineInfo(&lines));
    }

    // Renders the view plus the effects' margins, as the bridge does.
    std::vector<unsigned> Render(int viewWidth, int viewHeight) {
        GxEffect* effect = text.GetEffect();
        width = viewWidth + effect->getLeftOffset() + effect->getRightOffset();
        height = viewHeight + effect->getTopOffset() + effect->getBottomOffset();
        text.GetView()->SetSize(viewWidth, viewHeight);
        text.GetView()->SetBitmapWidth(width);
        text.GetView()->SetBitmapHeight(height);
        pixels = text.RenderTextEffect(width, height);
        return pixels != nullptr ? std::vector<unsigned>(pixels, pixels + size_t(width) * size_t(height))
                                 : std::vector<unsigned>();
    }

    const GxLineInfo* Line(int i) { return static_cast<GxLineInfo*>(text.GetLineInfo()->Get(i)); }

    GxTextObject text;
    const unsigned* pixels = nullptr;
    int width = 0, height = 0;
};

// Each render moves the line boxes by the margins again (deliberately, as the
// bridge has always done) and draws the same picture; a render at another
// size takes new images and frees the old ones.
TEST_F(RenderTest, EveryRenderMovesTheBackgroundBoxesAndDrawsTheSamePicture) {
    ASSERT_GE(text.GetEffect()->addStrokeText(3.0f, 0xFF0000FFu, 1.0f, 0, 1), 0);
    SetLines({{0, 3}});
    const std::vector<unsigned> first = Render(60, 40);
    ASSERT_FALSE(first.empty());
    EXPECT_EQ(Line(0)->bounds.left, 3);
    EXPECT_EQ(Line(0)->bounds.top, 20 - 16 + 3);
    EXPECT_TRUE(Render(60, 40) == first) << "a second render drew another picture";
    EXPECT_EQ(Line(0)->bounds.top, 20 - 16 + 6);
    EXPECT_EQ(Line(0)->bounds.bottom, 20 + 4 + 6);
    EXPECT_EQ(Render(70, 40).size(), size_t(76 * 46));
}

// An empty text draws a transparent picture and says so; a size too large to
// hold, or a negative one, is refused before anything is drawn.
TEST_F(RenderTest, AnEmptyTextIsTransparentAndBadSizesAreRefusedBeforeDrawing) {
    LogCapture log;
    Prepare(L"");
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(text.RenderTextEffect(30000, 30000), nullptr); }), 7);
    EXPECT_STRNE(Error::GetReason(), "");
    EXPECT_EQ(CodeOf([&] { EXPECT_EQ(text.RenderTextEffect(-1, 5), nullptr); }), 7);
    EXPECT_TRUE(Render(20, 10) == std::vector<unsigned>(200, 0u)) << "an empty text drew something";
    char expected[64];
    std::snprintf(expected, sizeof expected, "DrawTextEffect(%p) - textLength is 0", static_cast<void*>(&text));
    EXPECT_EQ(log.Count("GxFontDrawing", expected), 1);   // once: the refused renders drew nothing
}

TEST_F(RenderTest, ALineOutsideTheTextIsRefusedAndTheLastPictureKept) {
    SetLines({{0, 3}});
    const std::vector<unsigned> kept = Render(40, 30);
    const unsigned* good = pixels;
    ASSERT_FALSE(kept.empty());
    LogCapture log;
    for (auto range : {std::pair{1, 4}, std::pair{2, 1}, std::pair{-1, 2}}) {
        SetLines({{0, 3}, range});
        EXPECT_EQ(CodeOf([&] { EXPECT_TRUE(Render(40, 30).empty()); }), 7);
        char expected[96];
        std::snprintf(expected, sizeof expected, "RenderTextEffect(%p) - line 1 [%d, %d) lies outside the text of 3 units",
                      static_cast<void*>(&text), range.first, range.second);
        EXPECT_EQ(log.Count("GxTextObject", expected), 1);
    }
    EXPECT_TRUE(std::equal(kept.begin(), kept.end(), good));   // the last picture is still there
}

}  // namespace
}  // namespace Glimmer
