#include <gtest/gtest.h>

#include <memory>
#include <numeric>
#include <utility>
#include <vector>

#include "effect/GxEffect.h"
#include "font/FontManager.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
#include "platform/TextLayout.h"
#include "text/GxFontDrawing.h"
#include "text/GxLineInfo.h"
#include "text/GxTextObject.h"
#include "text/TextFixtures.h"

namespace Glimmer {
namespace {

struct Placement {
    int x, y;
    const GxGlyph* glyph;
    int width, height;
    bool operator==(const Placement& o) const { return x == o.x && y == o.y && glyph == o.glyph; }
};

// A text layer that records where the stack hands it each glyph.
class RecordingLayer : public GxECoreBase {
public:
    explicit RecordingLayer(std::vector<Placement>* out) : out_(out), property_(0xFF000000u, 1.0f) {
        style = GxECore::kText;
    }
    void render(GxECore::ParamRender* p) override {
        if (p->glyph != nullptr) out_->push_back({p->x, p->y, p->glyph, p->glyph->width, p->glyph->height});
    }
    void setProperty(GxProperty*) override {}
    GxProperty* getProperty() override { return &property_; }

private:
    std::vector<Placement>* out_;
    GxTextProperty property_;
};

class RecordingEffect : public GxEffect {
public:
    std::vector<Placement> placements;

protected:
    GxECoreBase* newLayer(int kind) override {
        return kind == GxECore::kText ? new RecordingLayer(&placements) : GxEffect::newLayer(kind);
    }
};

GxGlyph* NewGlyph(int width, int height, int top) {
    auto* glyph = new GxGlyph();
    glyph->buffer = new unsigned char[size_t(width) * size_t(height)]();
    glyph->width = uint16_t(width);
    glyph->height = uint16_t(height);
    glyph->top = top;
    return glyph;
}

TEST(GxFontDrawingTest, LinesArePlacedFromThePenInTheirDirection) {
    GxFontDrawing drawing;
    RecordingEffect effect;
    effect.addText(0xFF000000u);
    effect.initEffect(100, 100);
    GxGlyph* a = NewGlyph(10, 4, 5);
    GxGlyph* b = NewGlyph(20, 4, 7);
    List glyphs;
    glyphs.Construct();
    glyphs.Add(a);
    glyphs.Add(b);

    drawing._DoRender(3 * 64, 40 * 64, &glyphs, &effect, 1);
    EXPECT_EQ(effect.placements, (std::vector<Placement>{{3, 35, a, 0, 0}, {13, 33, b, 0, 0}}));
    effect.placements.clear();
    drawing._DoRender(3 * 64, 40 * 64, &glyphs, &effect, -1);
    EXPECT_EQ(effect.placements, (std::vector<Placement>{{3, 33, b, 0, 0}, {23, 35, a, 0, 0}}));
    effect.placements.clear();
    // Fractions of a pixel are dropped, as is a negative y's remainder (arithmetic shift).
    drawing._DoRender(3 * 64 + 63, -1, &glyphs, &effect, 1);
    EXPECT_EQ(effect.placements.front(), (Placement{3, -1 - 5, a, 0, 0}));

    effect.placements.clear();
    List empty;
    empty.Construct();
    drawing._DoRender(0, 0, &empty, &effect, 1);
    drawing._DoRender(0, 0, nullptr, &effect, 1);
    EXPECT_TRUE(effect.placements.empty());
    for (GxGlyph* glyph : {a, b}) {
        delete[] glyph->buffer;
        delete glyph;
    }
}

// Each line is one mask: as wide as its advance, as high as its ink, with the
// baseline `top` rows down. After a pass the glyph list keeps the last line's.
class LineMaskTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(text.Construct());
        ASSERT_TRUE(text.SetFont(Testing::kDejaVuSans));
        ASSERT_TRUE(text.SetText(L"Hg  x"));
        Platform::Paint paint;
        paint.size = 40.0f;
        text.SetPaint(paint);
    }

    // The mask of the one line [start, end), or null when none was kept.
    const GxGlyph* MaskOf(int start, int end) {
        List lines;
        lines.Construct();
        auto* line = new GxLineInfo();
        line->start = start;
        line->end = end;
        line->baseline = 50;
        lines.Add(line);
        EXPECT_TRUE(text.SetLineInfo(&lines));
        GxBitmap dst(200, 100, 4);
        text.GetFont()->DrawTextEffect(&text, &dst);
        const List* kept = text.GetFont()->GetGlyphList();
        return kept->GetCount() == 1 ? static_cast<const GxGlyph*>(kept->Get(0)) : nullptr;
    }

    GxTextObject text;
};

TEST_F(LineMaskTest, AMaskCoversTheAdvanceAndTheInk) {
    const GxGlyph* mask = MaskOf(0, 2);
    ASSERT_NE(mask, nullptr);
    EXPECT_GT(mask->width, 45);   // two letters of a 40 px face
    EXPECT_LT(mask->width, 60);
    EXPECT_NEAR(mask->top, 30, 1);                  // cap height 0.73 em, rounded out
    EXPECT_NEAR(mask->height - mask->top, 9, 1);    // the descender of g
    EXPECT_EQ(mask->left, 0);
    int inked = 0;
    for (int i = 0; i < mask->width * mask->height; ++i) inked += mask->buffer[i] != 0;
    EXPECT_GT(inked, 200);
}

TEST_F(LineMaskTest, SpacesAndBadRangesGiveEmptyMasks) {
    const GxGlyph* spaces = MaskOf(2, 4);
    ASSERT_NE(spaces, nullptr);
    EXPECT_GT(spaces->width, 0);   // the pen moves, nothing is inked
    EXPECT_EQ(spaces->height, 0);
    for (auto range : {std::pair{3, 99}, std::pair{4, 2}, std::pair{-1, 1}}) {
        const GxGlyph* mask = MaskOf(range.first, range.second);
        ASSERT_NE(mask, nullptr);
        EXPECT_EQ(mask->width, 0);
        EXPECT_EQ(mask->height, 0);
    }
}

// Text[start, end) laid out as the drawing pass does, and all of its ink:
// the coverage drawn with room on every side.
struct LineInk {
    float advance;
    long coverage;
};

LineInk InkOf(GxTextObject& text, int start, int end) {
    Platform::FontFamilies families;
    int weight = 400;
    FontManager::GetInstance()->GetMinikinFontFamilies(families, text.GetFont()->GetFontPath(), &weight);
    auto typeface = Platform::CreateTypefaceFromFamilies(families, weight, text.isItalicTextStyle());
    typeface->systemFallback = FontManager::GetInstance()->IsSystemFontFamiliesAlreadySet();
    std::unique_ptr<uint16_t[]> units(text.GetText()->GetUTF16());
    const Platform::Paint paint = text.GetPaint();
    Platform::Layout layout;
    Platform::LayoutText(paint, Platform::Bidi::kDefaultLtr, *typeface, units.get(),
                         size_t(text.GetText()->GetUTF16Size() - 1), size_t(start), size_t(end - start), 0,
                         size_t(end), &layout);
    constexpr int kRoom = 64;
    const int width = int(layout.bounds.right - layout.bounds.left) + 2 * kRoom;
    const int height = int(layout.bounds.bottom - layout.bounds.top) + 2 * kRoom;
    std::vector<uint8_t> mask(size_t(width) * size_t(height));
    Platform::ForEachFontRun(layout, paint, [&](size_t first, size_t last, const Platform::RunFont& font) {
        std::vector<uint16_t> ids;
        std::vector<float> positions;
        for (size_t i = first; i < last; ++i) {
            ids.push_back(uint16_t(layout.glyphs[i].glyphId));
            positions.push_back(layout.glyphs[i].x);
            positions.push_back(layout.glyphs[i].y);
        }
        Platform::DrawGlyphs(font, ids.data(), positions.data(), ids.size(), kRoom - layout.bounds.left,
                             kRoom - layout.bounds.top, mask.data(), width, height);
    });
    return {layout.advance, std::accumulate(mask.begin(), mask.end(), 0L)};
}

TEST_F(LineMaskTest, SlantedEmboldenedAndItalicInkIsNeverCut) {
    ASSERT_TRUE(text.SetText(L"Wolf fly"));
    enum Width { kAdvance, kWider, kEither };
    const struct {
        float skewX;
        bool fakeBold, italic;
        Width width;
    } cases[] = {
        {0.0f, false, false, kAdvance}, {0.0f, true, true, kEither}, {0.5f, false, false, kWider},
        {0.5f, true, true, kEither},    {-2.0f, true, false, kWider}, {2.0f, true, false, kWider},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(testing::Message() << "skew " << c.skewX << " bold " << c.fakeBold << " italic " << c.italic);
        Platform::Paint paint;
        paint.size = 40.0f;
        paint.skewX = c.skewX;
        paint.embolden = c.fakeBold;
        text.SetPaint(paint);
        text.SetTextStyle(false, c.italic);
        const GxGlyph* mask = MaskOf(0, 8);
        ASSERT_NE(mask, nullptr);
        const LineInk ink = InkOf(text, 0, 8);
        EXPECT_EQ(std::accumulate(mask->buffer, mask->buffer + mask->width * mask->height, 0L), ink.coverage);
        if (c.width != kEither) {
            EXPECT_EQ(mask->width > int(ink.advance), c.width == kWider);
        }
        EXPECT_GE(mask->width, int(ink.advance));
    }
}

}  // namespace
}  // namespace Glimmer
