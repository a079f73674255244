#include <gtest/gtest.h>

#include <vector>

#include "effect/GxEffect.h"
#include "foundation/List.h"
#include "text/GxFontDrawing.h"

namespace Glimmer {
namespace {

struct Placement {
    int x, y;
    const GxGlyph* glyph;
    bool operator==(const Placement& o) const { return x == o.x && y == o.y && glyph == o.glyph; }
};

// A text layer that records where the stack hands it each glyph.
class RecordingLayer : public GxECoreBase {
public:
    explicit RecordingLayer(std::vector<Placement>* out) : out_(out), property_(0xFF000000u, 1.0f) {
        style = GxECore::kText;
    }
    void render(GxECore::ParamRender* p) override {
        if (p->glyph != nullptr) out_->push_back({p->x, p->y, p->glyph});
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

// Glyphs go from the pen (26.6 fixed point, fractions dropped) in the line's
// direction, each with its top `top` rows above the baseline.
TEST(GxFontDrawingTest, LinesArePlacedFromThePenInTheirDirection) {
    GxFontDrawing drawing;
    RecordingEffect effect;
    effect.addText(0xFF000000u);
    effect.initEffect(100, 100);
    GxGlyph a, b;
    a.width = 10;
    a.top = 5;
    b.width = 20;
    b.top = 7;
    List glyphs;
    glyphs.Construct();
    glyphs.Add(&a);
    glyphs.Add(&b);
    const struct {
        int penX, penY, direction;
        std::vector<Placement> expected;
    } cases[] = {
        {3 * 64, 40 * 64, 1, {{3, 35, &a}, {13, 33, &b}}},
        {3 * 64, 40 * 64, -1, {{3, 33, &b}, {23, 35, &a}}},
        {3 * 64 + 63, -1, 1, {{3, -6, &a}, {13, -8, &b}}},   // a negative y's remainder too (arithmetic shift)
    };
    for (const auto& c : cases) {
        effect.placements.clear();
        drawing._DoRender(c.penX, c.penY, &glyphs, &effect, c.direction);
        EXPECT_EQ(effect.placements, c.expected) << c.penX << ", " << c.penY << ", direction " << c.direction;
    }
    effect.placements.clear();
    drawing._DoRender(0, 0, nullptr, &effect, 1);
    EXPECT_TRUE(effect.placements.empty());
}

}  // namespace
}  // namespace Glimmer
