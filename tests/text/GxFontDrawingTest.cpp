#include <gtest/gtest.h>

#include <utility>
#include <vector>

#include "effect/GxEffect.h"
#include "foundation/GxString.h"
#include "foundation/List.h"
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

}  // namespace
}  // namespace Glimmer
