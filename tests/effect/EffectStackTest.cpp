// The effect stack: ids and replacement, the argument conversions of the
// add operations, margins, the mode decision and render order, what each
// layer is handed at every phase, the mask and text box, the final merge,
// and the key.

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <map>
#include <memory>
#include <string>
#include <vector>

#include "effect/GxEffect.h"
#include "effect/GxText.h"
#include "support/LogCapture.h"

namespace Glimmer {
namespace {

// --- a layer that records what the stack hands it

struct Journal {
    std::vector<std::string> events;
    std::vector<GxECore::ParamInit> inits;
    std::vector<GxECore::ParamRender> renders;
    struct Post {
        int kind;
        GxBitmap* dst;
        GxBitmap* extraDst;
        GxRect rect;
        int mode;
    };
    std::vector<Post> posts;
};

// A copy of the record with its dynamic type, so the stack's dynamic checks
// (stroke position, bevel style) see what a real layer would hold.
GxProperty* Clone(GxProperty* p) {
    if (auto* s = dynamic_cast<GxStrokeProperty*>(p)) return new GxStrokeProperty(*s);
    if (auto* e = dynamic_cast<GxEmbossProperty*>(p)) return new GxEmbossProperty(*e);
    if (auto* b = dynamic_cast<GxBevelProperty*>(p)) return new GxBevelProperty(*b);
    return new GxTextProperty(p->color, p->opacity);
}

class RecordingLayer : public GxECoreBase {
public:
    RecordingLayer(int kind, Journal* journal) : journal_(journal) { style = kind; }
    ~RecordingLayer() override { delete property_; }

    void setProperty(GxProperty* p) override {
        if (p == nullptr) return;
        delete property_;
        property_ = Clone(p);
    }
    GxProperty* getProperty() override { return property_; }
    bool initEffect(GxECore::ParamInit* p) override {
        journal_->inits.push_back(*p);
        journal_->events.push_back("init " + std::to_string(style));
        return false;  // ignored by the stack
    }
    void render(GxECore::ParamRender* p) override { journal_->renders.push_back(*p); }
    void doPostProcessing(GxECore::ParamPostProcessing* p) override {
        journal_->posts.push_back({style, p->dst, p->extraDst, *p->textRect, p->separateWorkImage});
        journal_->events.push_back("post " + std::to_string(style));
        if (paint_ && p->dst != nullptr) Fill(p->dst);
    }
    int32_t getLeftOffset() override { return offsets_[0]; }
    int32_t getRightOffset() override { return offsets_[1]; }
    int32_t getTopOffset() override { return offsets_[2]; }
    int32_t getBottomOffset() override { return offsets_[3]; }

    void SetOffsets(int l, int r, int t, int b) { offsets_[0] = l, offsets_[1] = r, offsets_[2] = t, offsets_[3] = b; }
    // Paints the whole target with these bytes when post-processed.
    void Paint(std::array<uint8_t, 4> rgba) { paint_ = true, rgba_ = rgba; }
    void ReportStyle(int kind) { style = kind; }

private:
    void Fill(GxBitmap* b) {
        for (size_t i = 0; i < size_t(b->width) * b->height; ++i)
            for (int c = 0; c < 4; ++c) b->pixels[i * 4 + c] = rgba_[c];
    }

    Journal* journal_;
    GxProperty* property_ = nullptr;
    int offsets_[4] = {0, 0, 0, 0};
    bool paint_ = false;
    std::array<uint8_t, 4> rgba_{};
};

class RecordingStack : public GxEffect {
public:
    RecordingStack() : GxEffect(nullptr) {}
    Journal journal;
    RecordingLayer* Layer(int kind) { return static_cast<RecordingLayer*>(getEffect(kind)); }

protected:
    GxECoreBase* newLayer(int kind) override { return new RecordingLayer(kind, &journal); }
};

std::vector<int> Kinds(const std::vector<GxECoreBase*>& layers) {
    std::vector<int> out;
    for (GxECoreBase* l : layers) out.push_back(l->getStyle());
    return out;
}

int AddStroke(GxEffect& s, int position) { return s.addStrokeText(3, 0xFF000000, 1, 0, position); }
int AddBevel(GxEffect& s, int kind, int style) {
    return kind == 5 ? s.addBevelText(style, 1, 5, 1, 0, 0, 1, 0, 0, 0, 1, 0, 1)
                     : s.addEmbossText(style, 1, 5, 1, 0, 0, 1, 0, 0, 0, 1, 0, 1);
}

// Draws one 1x1 fully covered glyph at (0, 0) on a w x h surface.
void Draw(GxEffect& s, GxBitmap* dst, int w = 2, int h = 2) {
    static unsigned char full = 255;
    GxGlyph glyph;
    glyph.buffer = &full;
    glyph.width = 1;
    glyph.height = 1;
    s.initEffect(w, h);
    s.setDstBitmap(dst);
    s.renderEffectLayer(0, 0, &glyph);
    s.doEffectPostProcessing();
}

// --- ids, replacement and removal

TEST(EffectStackLayers, IdsCountFromZeroAndRestartAfterClearing) {
    GxEffect s(nullptr);
    EXPECT_EQ(s.addText(0xFF000000), 0);
    EXPECT_EQ(s.addOuterShadowText(0, 1, 1, 0xFF000000, 1), 1);
    EXPECT_EQ(AddStroke(s, 1), 2);
    s.cleanAllEffect();
    EXPECT_FALSE(s.hasEffects());
    EXPECT_EQ(AddStroke(s, 1), 0);
    EXPECT_EQ(s.getNewEffectId(), 1);
}

TEST(EffectStackLayers, AddingAKindAgainReplacesItsParameters) {
    GxEffect s(nullptr);
    s.addText(0xFF000000);
    const int id = s.addOuterShadowText(0, 10, 1, 0xFF000000, 1);
    EXPECT_EQ(s.addOuterShadowText(90, 20, 2, 0xFF000000, 1), id);
    ASSERT_EQ(s.getLayers().size(), 2u);
    auto* p = dynamic_cast<GxOuterShadowProperty*>(s.getEffect(1)->getProperty());
    ASSERT_NE(p, nullptr);
    EXPECT_EQ(p->distance, 20.0f);
    EXPECT_EQ(p->angle, 90.0f);
    EXPECT_EQ(s.getNewEffectId(), 2);  // the replacement took no id
}

TEST(EffectStackLayers, UnknownKindsAreRefused) {
    GxEffect s(nullptr);
    for (int kind : {0, 9, 13, 14, -1}) {
        EXPECT_EQ(s.createEffect(-1, kind), nullptr) << kind;
        GxTextProperty p(0, 1);
        EXPECT_EQ(s.addEffect(kind, &p), -1) << kind;
    }
    EXPECT_TRUE(s.getLayers().empty());
    // A created layer takes the id it is given and is not in the stack yet.
    std::unique_ptr<GxECoreBase> layer(s.createEffect(41, 11));
    ASSERT_NE(layer, nullptr);
    EXPECT_TRUE(layer->getId() == 41 && layer->getStyle() == 11 && !s.hasEffect(11));
}

TEST(EffectStackLayers, RemovingKeepsTheOthersInOrder) {
    RecordingStack s;
    s.addText(0xFF000000);                         // 0
    s.addOuterShadowText(0, 1, 1, 0xFF000000, 1);  // 1
    AddStroke(s, 2);                               // 2
    s.initEffect(1, 1);
    EXPECT_TRUE(s.removeEffect(1));
    EXPECT_FALSE(s.removeEffect(1));
    EXPECT_EQ(Kinds(s.getLayers()), (std::vector<int>{12, 10}));
    EXPECT_EQ(s.getRenderOrder().size(), 2u);  // no dangling layer left to post-process
    EXPECT_FALSE(s.hasEffect(1));
    EXPECT_EQ(s.getEffect(99), nullptr);
    s.compositeLayers(nullptr);
}

TEST(EffectStackLayers, TextOpacityAloneMeansThereAreEffects) {
    GxEffect s(nullptr);
    EXPECT_FALSE(s.hasEffects());
    s.setTextOpacity(0.5f);
    EXPECT_TRUE(s.hasEffects());
    EXPECT_EQ(s.getTextOpacity(), 0.5f);
    s.clearTextOpacity();
    EXPECT_FALSE(s.hasEffects());
    for (float given : {3.0f, -1.0f, std::nanf("")}) {
        s.setTextOpacity(given);
        EXPECT_EQ(s.getTextOpacity(), given > 1.0f ? 1.0f : 0.0f) << given;
    }
}

TEST(EffectStackLayers, CopyHasItsOwnLayersWithTheSameIdsAndParameters) {
    GxEffect original(nullptr);
    original.addText(0x80FF0000);
    GxGradient stops[2] = {{0xFF0000FF, 1, 0}, {0xFFFF0000, 1, 1}};
    original.addOuterGlowText(5, 0xFF00FF00, 1, 2, stops);
    original.removeEffect(0);
    original.addStrokeText(2, 0xFF000000, 1, 0, 1);
    original.setTextOpacity(0.25f);

    GxEffect copy(original);
    ASSERT_EQ(copy.getLayers().size(), 2u);
    for (size_t i = 0; i < 2; ++i) {
        GxECoreBase *a = copy.getLayers()[i], *b = original.getLayers()[i];
        EXPECT_TRUE(a != b && a->getProperty() != b->getProperty() && a->getId() == b->getId() &&
                    a->getStyle() == b->getStyle()) << i;
    }
    EXPECT_EQ(copy.getTextOpacity(), 0.25f);
    EXPECT_EQ(copy.getTextAlpha(), 0x80);
    std::unique_ptr<char[]> a(original.getMapKey()), b(copy.getMapKey());
    EXPECT_STREQ(a.get(), b.get());
    EXPECT_EQ(copy.getNewEffectId(), 3);
}

// --- conversions of the add operations

template <typename Record>
Record* Held(GxEffect& s, int kind) {
    GxECoreBase* layer = s.getEffect(kind);
    return layer == nullptr ? nullptr : dynamic_cast<Record*>(layer->getProperty());
}

TEST(EffectStackArguments, ShadowsFoldAngleClampPercentAndPremultiply) {
    GxEffect s(nullptr);
    s.addOuterShadowText(-30.5f, 150.0f, -5.0f, 0x12FF8040, 0.5f);
    auto* p = Held<GxOuterShadowProperty>(s, 1);
    ASSERT_NE(p, nullptr);
    EXPECT_EQ((std::vector<float>{p->angle, p->distance, p->size, p->opacity}),
              (std::vector<float>{330.0f, 100.0f, 0.0f, 0.5f}));
    // Alpha 0.5 * 255 + 0.5 = 128 replaces 0x12 and scales the channels.
    EXPECT_EQ(p->color, 0x80804020u);

    s.addInnerShadowText(725.0f, 7.9f, 3.2f, 0xFFFFFFFF, 2.0f);
    auto* q = Held<GxInnerShadowProperty>(s, 2);
    ASSERT_NE(q, nullptr);
    EXPECT_EQ((std::vector<float>{q->angle, q->distance, q->opacity}), (std::vector<float>{5.0f, 7.0f, 1.0f}));
    EXPECT_EQ(q->color, 0xFFFFFFFFu);
    s.addInnerShadowText(0, 0, 0, 0xFFFFFFFF, -1.0f);
    EXPECT_EQ(Held<GxInnerShadowProperty>(s, 2)->color, 0u);
}

TEST(EffectStackArguments, GlowsTakeAlphaFromOpacityAndCopyTheRamp) {
    GxEffect s(nullptr);
    GxGradient stops[2] = {{0x00112233, 0.25f, 0.256f}, {0xFF445566, 7.0f, 0.999f}};
    s.addOuterGlowText(150.0f, 0x11223344, 0.5f, 2, stops);
    auto* p = Held<GxOuterGlowProperty>(s, 3);
    ASSERT_NE(p, nullptr);
    EXPECT_EQ(p->size, 100.0f);
    EXPECT_EQ(p->color, 0x80223344u);  // RGB kept, not premultiplied
    ASSERT_EQ(p->count, 2);
    ASSERT_NE(p->stops, nullptr);
    EXPECT_NE(p->stops, stops);
    EXPECT_EQ(p->stops[0].color, 0x40112233u);  // 0.25 * 255 + 0.5 = 64
    EXPECT_EQ(p->stops[1].color, 0xFF445566u);
    EXPECT_TRUE(p->stops[0].position == 0.25f && p->stops[1].position == 0.99f);
    EXPECT_EQ(stops[0].color, 0x00112233u);  // the caller's ramp is untouched

    // No ramp: the count goes to 0 so nobody reads stops that are not there.
    s.addInnerGlowText(5, 0xFF000000, 1, 3, nullptr);
    auto* q = Held<GxInnerGlowProperty>(s, 4);
    ASSERT_NE(q, nullptr);
    EXPECT_TRUE(q->count == 0 && q->stops == nullptr);
}

TEST(EffectStackArguments, FillsStrokePatternAndBevel) {
    GxEffect s(nullptr);
    GxGradient stops[1] = {{0xFFFFFFFF, 0.0f, 0.5f}};
    s.addLinearGradientText(-90.9f, 5.0f, 0.7f, 1, stops);
    auto* linear = Held<GxLinearGradientProperty>(s, 7);
    ASSERT_NE(linear, nullptr);
    EXPECT_TRUE(linear->angle == 270.0f && linear->scale == 2.0f);
    EXPECT_EQ(linear->stops[0].color, 0x00FFFFFFu);
    s.addRadialGradientText(-1.0f, 0.3f, 1, stops);
    ASSERT_NE(Held<GxRadialGradientProperty>(s, 8), nullptr);
    EXPECT_EQ(Held<GxRadialGradientProperty>(s, 8)->scale, 0.0f);

    s.addStrokeText(7.9f, 0x00FFFFFF, 1.0f, 3, 2);
    auto* stroke = Held<GxStrokeProperty>(s, 10);
    ASSERT_NE(stroke, nullptr);
    EXPECT_EQ((std::vector<float>{stroke->size, float(stroke->a), float(stroke->position)}),
              (std::vector<float>{7.0f, 3.0f, 2.0f}));
    EXPECT_EQ(stroke->color, 0xFFFFFFFFu);

    GxBitmap tile(1, 1, 4);
    s.addPatternText(&tile, 20.0f, 1.5f);
    auto* pattern = Held<GxPatternProperty>(s, 11);
    ASSERT_NE(pattern, nullptr);
    EXPECT_TRUE(pattern->scale == 10.0f && pattern->opacity == 1.0f);

    // The two colour opacities are clamped; the layer opacity passes as given.
    s.addBevelText(1, 4.0f, 6.0f, 1, 0, 2, 1.5f, 30.0f, 45.0f, 0xFFFFFFFF, 2.0f, 0xFF000000, -1.0f);
    auto* bevel = Held<GxBevelProperty>(s, 5);
    ASSERT_NE(bevel, nullptr);
    EXPECT_EQ((std::vector<float>{bevel->highlightOpacity, bevel->shadowOpacity, bevel->opacity}),
              (std::vector<float>{1.0f, 0.0f, 1.5f}));
}

TEST(EffectStackArguments, TextColourAlphaAndLogLines) {
    Testing::LogCapture log;
    GxEffect s(nullptr);
    char self[32];
    std::snprintf(self, sizeof self, "%p", static_cast<void*>(&s));

    s.addText(0x80FF0000, 0.5f);
    EXPECT_EQ(s.getTextAlpha(), 0x80);
    EXPECT_EQ(s.getEffect(12)->getProperty()->color, 0x80800000u);
    EXPECT_EQ(log.Count("GxEffect", std::string("AddText(") + self +
                                        ") - (color:-2130771968/opacity:0.500000)"),
              1);

    s.addText(0x40123456);
    EXPECT_EQ(s.getTextAlpha(), 0x40);
    EXPECT_EQ(s.getEffect(12)->getProperty()->color, 0xFF123456u);
    EXPECT_EQ(log.Count("GxEffect", std::string("AddText(") + self + ") - (color:40123456)"), 1);
    for (const auto& line : log.Lines()) EXPECT_EQ(line.priority, 3);
}

// --- margins

TEST(EffectStackMargins, EachSideIsTheLargestOverTheLayers) {
    RecordingStack s;
    EXPECT_EQ(s.getLeftOffset(), 0);
    s.addText(0xFF000000);
    AddStroke(s, 1);
    s.Layer(12)->SetOffsets(3, 1, -9, 7);
    s.Layer(10)->SetOffsets(2, 5, -4, 1);
    // The top is never below 0.
    EXPECT_EQ((std::vector<int>{s.getLeftOffset(), s.getRightOffset(), s.getTopOffset(), s.getBottomOffset()}),
              (std::vector<int>{3, 5, 0, 7}));
}

// --- mode decision, order and dispatch

struct ModeCase {
    const char* name;
    void (*build)(GxEffect&);
    int mode;
};

TEST(EffectStackDrawing, ModeFollowsOpacityEmbossAndCentredStroke) {
    const ModeCase cases[] = {
        {"text only", [](GxEffect& s) { s.addText(0xFF000000); }, 0},
        {"text and emboss", [](GxEffect& s) { s.addText(0xFF000000); AddBevel(s, 6, 1); }, 1},
        {"centred stroke", [](GxEffect& s) { AddStroke(s, 0); }, 1},
        {"outside stroke", [](GxEffect& s) { AddStroke(s, 1); }, 0},
        {"inside bevel", [](GxEffect& s) { AddBevel(s, 5, 1); }, 0},
        {"translucent text", [](GxEffect& s) { s.addText(0xFF000000); s.setTextOpacity(0.99f); }, 1},
        {"empty", [](GxEffect&) {}, 0},
        {"layer style", [](GxEffect& s) { s.addText(0xFF000000); s.setLayerStyle(true); }, 1},
    };
    for (const ModeCase& c : cases) {
        RecordingStack s;
        c.build(s);
        s.initEffect(3, 2);
        EXPECT_EQ(s.getSeparateWorkImage(), c.mode) << c.name;
        for (const auto& init : s.journal.inits) {
            EXPECT_EQ(init.separateWorkImage, c.mode) << c.name;
            EXPECT_EQ(init.width, 3);
            EXPECT_EQ(init.height, 2);
        }
        ASSERT_NE(s.getSrcBitmap(), nullptr);
        EXPECT_EQ(s.getSrcBitmap()->bytesPerPixel, 1u);
        s.compositeLayers(nullptr);
        EXPECT_EQ(s.getSeparateWorkImage(), 0);
        EXPECT_EQ(s.getSrcBitmap(), nullptr);
    }
}

TEST(EffectStackDrawing, NormalModeRunsOverTextThenTextThenUnderText) {
    RecordingStack s;
    s.addOuterShadowText(0, 1, 1, 0xFF000000, 1);  // under
    AddStroke(s, 2);                               // over (inside stroke)
    s.addText(0xFF000000);
    s.addInnerGlowText(1, 0xFF000000, 1, 0, nullptr);  // over
    s.addOuterGlowText(1, 0xFF000000, 1, 0, nullptr);  // under
    AddBevel(s, 5, 1);                                 // inside bevel: over
    s.addLinearGradientText(0, 1, 1, 0, nullptr);      // over
    s.initEffect(4, 4);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{7, 5, 4, 10, 12, 3, 1}));

    // An outside bevel and an outside stroke move under the text.
    AddBevel(s, 5, 2);
    AddStroke(s, 1);
    s.initEffect(4, 4);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{7, 4, 12, 5, 3, 10, 1}));
    // Layers are initialised in that order too.
    std::vector<std::string> tail(s.journal.events.end() - 7, s.journal.events.end());
    EXPECT_EQ(tail, (std::vector<std::string>{"init 7", "init 4", "init 12", "init 5", "init 3",
                                              "init 10", "init 1"}));
    // Two layers reporting the text kind keep their creation order.
    s.Layer(4)->ReportStyle(12);
    s.initEffect(4, 4);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{7, 12, 12, 5, 3, 10, 1}));
    EXPECT_EQ(s.getRenderOrder()[1], s.getLayers()[2]);
    s.compositeLayers(nullptr);
}

TEST(EffectStackDrawing, WorkImageModeRunsReversedWithTextLast) {
    RecordingStack s;
    s.addOuterShadowText(0, 1, 1, 0xFF000000, 1);
    s.addText(0xFF000000);
    AddBevel(s, 6, 1);
    AddStroke(s, 0);
    s.addInnerGlowText(1, 0xFF000000, 1, 0, nullptr);
    s.initEffect(4, 4);
    EXPECT_EQ(s.getSeparateWorkImage(), 1);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{4, 10, 6, 1, 12}));
    s.compositeLayers(nullptr);
}

TEST(EffectStackDrawing, EachKindDrawsIntoItsTargetInWorkImageMode) {
    RecordingStack s;
    for (int kind : {1, 2, 3, 4, 7, 8, 11}) {
        GxTextProperty p(0, 1);
        s.addEffect(kind, &p);
    }
    s.addText(0xFF000000);
    AddBevel(s, 5, 1);
    AddBevel(s, 6, 0);  // the emboss forces the work image
    GxBitmap dst(2, 2, 4);

    auto targets = [&](int strokePosition, int bevelStyle) {
        AddStroke(s, strokePosition);
        AddBevel(s, 5, bevelStyle);
        s.journal.posts.clear();
        Draw(s, &dst);
        std::map<int, std::pair<std::string, std::string>> out;
        for (const auto& post : s.journal.posts) {
            auto name = [&](GxBitmap* b) -> std::string {
                if (b == nullptr) return "null";
                if (b == &dst) return "dst";
                return b->bytesPerPixel == 4 && b->width == 2 && b->height == 2 ? "work" : "?";
            };
            EXPECT_EQ(post.mode, 1);
            out[post.kind] = {name(post.dst), name(post.extraDst)};
        }
        s.compositeLayers(&dst);
        return out;
    };
    using P = std::pair<std::string, std::string>;
    auto t = targets(0, 1);
    EXPECT_EQ(t[1], P("work", "null"));
    EXPECT_EQ(t[3], P("work", "null"));
    EXPECT_EQ(t[6], P("work", "dst"));
    EXPECT_EQ(t[10], P("work", "dst"));
    EXPECT_EQ(t[5], P("dst", "null"));
    for (int kind : {2, 4, 7, 8, 11, 12}) EXPECT_EQ(t[kind], P("dst", "null")) << kind;
    t = targets(2, 0);
    EXPECT_EQ(t[10], P("dst", "null"));
    EXPECT_EQ(t[5], P("work", "null"));
    EXPECT_EQ(targets(1, 0)[10], P("work", "null"));
    EXPECT_EQ(targets(7, 0)[10], P("work", "null"));  // any other position

    // A layer that reports no kind of its own lies under the text and draws into the work image.
    s.Layer(11)->ReportStyle(13);
    EXPECT_EQ(targets(1, 1)[13], P("work", "null"));
}

// --- glyphs, mask and text box

TEST(EffectStackDrawing, GlyphsUniteIntoTheMaskAndTheClampedBox) {
    RecordingStack s;
    s.addText(0xFF000000);
    unsigned char a[6] = {10, 20, 30, 40, 50, 60};  // 3 x 2
    unsigned char b[4] = {100, 5, 7, 200};          // 2 x 2
    GxGlyph ga{a, 3, 2, 0, 0}, gb{b, 2, 2, 0, 0};
    s.initEffect(5, 4);
    GxBitmap dst(5, 4, 4);
    s.setDstBitmap(&dst);
    s.renderEffectLayer(1, 1, &ga);
    s.renderEffectLayer(-1, 2, &gb);
    s.renderEffectLayer(0, 0, nullptr);  // no glyph: layers are still called
    ASSERT_EQ(s.journal.renders.size(), 3u);
    const GxECore::ParamRender& second = s.journal.renders[1];
    EXPECT_TRUE(second.x == -1 && second.glyph == &gb && second.dst == &dst);
    EXPECT_EQ(s.journal.renders[2].glyph, nullptr);

    const GxRect* r = s.getTextRect();
    EXPECT_EQ((std::vector<int>{r->left, r->top, r->right, r->bottom}), (std::vector<int>{-1, 1, 4, 4}));
    const unsigned char* m = s.getSrcBitmap()->pixels;
    // Row 1: glyph a; row 2: a's second row over b's first (b enters at column 1).
    EXPECT_EQ(std::vector<int>(m + 5, m + 10), (std::vector<int>{0, 10, 20, 30, 0}));
    EXPECT_EQ(std::vector<int>(m + 10, m + 15), (std::vector<int>{5, 40, 50, 60, 0}));
    EXPECT_EQ(std::vector<int>(m + 15, m + 20), (std::vector<int>{200, 0, 0, 0, 0}));

    s.doEffectPostProcessing();
    ASSERT_EQ(s.journal.posts.size(), 1u);
    // The normal mode: the destination for all.
    EXPECT_TRUE(s.journal.posts[0].dst == &dst && s.journal.posts[0].extraDst == nullptr);
    const GxRect& seen = s.journal.posts[0].rect;
    EXPECT_EQ((std::vector<int>{seen.left, seen.top, seen.right, seen.bottom}),
              (std::vector<int>{0, 1, 4, 4}));
    s.compositeLayers(&dst);

    // The next drawing starts a new box with its first glyph.
    s.initEffect(5, 4);
    s.renderEffectLayer(3, 3, &gb);
    EXPECT_EQ((std::vector<int>{r->left, r->top, r->right, r->bottom}), (std::vector<int>{3, 3, 5, 5}));
    s.compositeLayers(nullptr);
}

TEST(EffectStackDrawing, EmptyOrOutsideBoxesCallNoLayer) {
    RecordingStack s;
    s.addText(0xFF000000);
    unsigned char px[4] = {255, 255, 255, 255};
    GxGlyph outside{px, 2, 2, 0, 0}, inside{px, 1, 1, 0, 0}, empty{px, 0, 2, 0, 0};
    GxBitmap dst(4, 4, 4);
    auto posts = [&](int x, GxGlyph* glyph) {
        s.journal.posts.clear();
        s.initEffect(4, 4);
        if (glyph != nullptr) s.renderEffectLayer(x, 1, glyph);
        s.doEffectPostProcessing();
        s.compositeLayers(&dst);
        return s.journal.posts.size();
    };
    EXPECT_EQ(posts(10, &outside), 0u);
    // A zero-sized mask alone opens a box with no area; layers still see it.
    s.journal.renders.clear();
    EXPECT_EQ(posts(1, &empty), 0u);
    EXPECT_EQ(s.journal.renders.size(), 1u);
    EXPECT_EQ(posts(1, &inside), 1u);

    // Drawing before initEffect, and a negative surface, stay harmless.
    GxEffect bare(nullptr);
    for (int size : {0, -3}) {
        if (size != 0) bare.initEffect(size, size);
        bare.renderEffectLayer(0, 0, &outside);
        bare.doEffectPostProcessing();
        bare.compositeLayers(&dst);
    }
}

// --- the final merge

std::array<int, 4> At(const GxBitmap& b, int i) {
    const uint8_t* p = b.pixels + i * 4;
    return {p[0], p[1], p[2], p[3]};
}

// An inside stroke paints everything outside the glyphs, so its reach shows
// which text box the layers were given.
struct InsideStrokeDrawing {
    GxEffect stack{nullptr};
    GxBitmap dst;
    InsideStrokeDrawing(int w, int h) : dst(unsigned(w), unsigned(h), 4) {
        stack.addStrokeText(1, 0xFF0000FF, 1, 0, 2);
        stack.addText(0xFF000000);
    }
    // One whole drawing; returns the text box the layers were given.
    std::array<int, 4> Run(std::vector<std::pair<GxGlyph, std::array<int, 2>>> glyphs) {
        std::memset(dst.pixels, 0, size_t(dst.width) * dst.height * 4);
        stack.initEffect(int(dst.width), int(dst.height));
        stack.setDstBitmap(&dst);
        for (auto& [glyph, at] : glyphs) stack.renderEffectLayer(at[0], at[1], &glyph);
        stack.doEffectPostProcessing();
        const GxRect box = *stack.getTextRect();
        stack.compositeLayers(&dst);
        return {box.left, box.top, box.right, box.bottom};
    }
};

TEST(EffectStackDrawing, ZeroSizedGlyphsWidenTheBoxAndEmptyDrawingsReuseIt) {
    unsigned char full[4] = {255, 255, 255, 255};
    const GxGlyph square{full, 2, 2, 0, 0}, line{full, 0, 3, 0, 0};
    {
        InsideStrokeDrawing d(8, 5);
        EXPECT_EQ(d.Run({{square, {2, 2}}, {line, {6, 1}}}), (std::array<int, 4>{2, 1, 6, 4}));
        EXPECT_EQ(At(d.dst, 0)[3], 255);  // a 2x2 box would leave the corner at 149
    }
    {
        InsideStrokeDrawing d(6, 5);
        EXPECT_EQ(d.Run({{square, {2, 2}}}), (std::array<int, 4>{2, 2, 4, 4}));
        // No glyph: the previous box again, over an empty mask.
        EXPECT_EQ(d.Run({}), (std::array<int, 4>{2, 2, 4, 4}));
        EXPECT_EQ(At(d.dst, 0)[2], 255);
    }
}

TEST(EffectStackComposite, StraightColourWithTheTextAlpha) {
    GxEffect s(nullptr);
    GxBitmap dst(4, 1, 4);
    const uint8_t before[16] = {64, 64, 64, 128, 255, 255, 255, 255, 100, 50, 0, 0, 9, 9, 9, 1};
    std::memcpy(dst.pixels, before, 16);
    s.initEffect(4, 1);
    s.compositeLayers(&dst);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{128, 128, 128, 128}));
    EXPECT_EQ(At(dst, 1), (std::array<int, 4>{255, 255, 255, 255}));
    EXPECT_EQ(At(dst, 2), (std::array<int, 4>{0, 0, 0, 0}));  // transparent: all zero

    // Text alpha 0x80 scales alpha and, through the 0xFF00 mask, the division.
    std::memcpy(dst.pixels, before, 16);
    s.addText(0x80000000);
    s.initEffect(4, 1);
    s.compositeLayers(&dst);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{128, 128, 128, 64}));
    EXPECT_EQ(At(dst, 1), (std::array<int, 4>{255, 255, 255, 128}));
    // Alpha 1 survives, and dividing by it saturates the colour.
    EXPECT_EQ(At(dst, 3), (std::array<int, 4>{255, 255, 255, 1}));
}

TEST(EffectStackComposite, OpaquePixelsKeepTheirColourAtFullTextAlpha) {
    GxEffect s(nullptr);
    GxBitmap dst(256, 1, 4);
    for (int v = 0; v < 256; ++v) {
        uint8_t* p = dst.pixels + v * 4;
        p[0] = uint8_t(v), p[1] = uint8_t(255 - v), p[2] = uint8_t(v / 3), p[3] = 255;
    }
    s.initEffect(256, 1);
    s.compositeLayers(&dst);
    for (int v = 0; v < 256; ++v)
        ASSERT_EQ(At(dst, v), (std::array<int, 4>{v, 255 - v, v / 3, 255})) << v;
}

TEST(EffectStackComposite, WorkImageShowsWhereCoverageIsEmpty) {
    RecordingStack s;
    s.addOuterShadowText(0, 1, 1, 0xFF000000, 1);
    s.addText(0xFF000000);
    s.Layer(1)->Paint({10, 20, 30, 40});     // into the work image
    s.Layer(12)->Paint({200, 100, 50, 255});  // into the destination
    s.setTextOpacity(0.5f);

    unsigned char coverage[3] = {0, 255, 128};
    GxGlyph glyph{coverage, 3, 1, 0, 0};
    GxBitmap dst(3, 1, 4);
    s.initEffect(3, 1);
    s.setDstBitmap(&dst);
    s.renderEffectLayer(0, 0, &glyph);
    s.doEffectPostProcessing();
    EXPECT_EQ(s.journal.events.back(), "post 12");
    s.compositeLayers(&dst);
    // Merged: m = 0 the work pixel, m = 255 the destination, m = 128 a mix
    // (105, 60, 40, 148); then converted to straight colour.
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{64, 128, 192, 40}));
    EXPECT_EQ(At(dst, 1), (std::array<int, 4>{200, 100, 50, 255}));
    EXPECT_EQ(At(dst, 2), (std::array<int, 4>{181, 103, 69, 148}));
    EXPECT_TRUE(s.getSrcBitmap() == nullptr && s.getDstBitmap() == nullptr);
}

TEST(EffectStackComposite, TextLayerEndToEndOverAHandMadeMask) {
    Testing::LogCapture log;
    GxEffect s;
    s.addText(0xFF0000FF);
    unsigned char coverage[4] = {0, 128, 255, 1};
    GxGlyph glyph{coverage, 2, 2, 0, 0};
    GxBitmap dst(3, 2, 4);
    for (int pass = 0; pass < 2; ++pass) {  // a stack is drawn any number of times
        std::memset(dst.pixels, 0, 24);
        s.initEffect(3, 2);
        s.setDstBitmap(&dst);
        s.renderEffectLayer(1, 0, &glyph);
        s.doEffectPostProcessing();
        s.compositeLayers(&dst);
        EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 0, 0}));
        EXPECT_EQ(At(dst, 1), (std::array<int, 4>{0, 0, 0, 0}));
        EXPECT_EQ(At(dst, 2), (std::array<int, 4>{0, 0, 255, 128}));
        EXPECT_EQ(At(dst, 4), (std::array<int, 4>{0, 0, 255, 255}));
        EXPECT_EQ(At(dst, 5), (std::array<int, 4>{0, 0, 255, 1}));
    }
    char self[32];
    std::snprintf(self, sizeof self, "%p", static_cast<void*>(&s));
    EXPECT_EQ(log.Count("GxEffect", std::string("GxEffect(") + self + ")"), 1);
    for (const char* line : {"InitEffect(%s)", "DoEffectPostProcessing(%s) - start",
                             "DoEffectPostProcessing(%s) - end", "CompositeLayers(%s) - start",
                             "CompositeLayers(%s) - end"}) {
        char expected[96];
        std::snprintf(expected, sizeof expected, line, self);
        EXPECT_EQ(log.Count("GxEffect", expected), 2) << expected;
    }
    EXPECT_EQ(log.Count("Blender", "Blender - GxE_BLEND_OTHER"), 2);
}

// --- the text layer on its own

TEST(TextLayer, DrawsOnlyWithPropertyAndPicksTheBlendByMode) {
    Testing::LogCapture log;
    GxText text;
    EXPECT_TRUE(text.getStyle() == 12 && text.getId() == -1 && text.getOffset() == 0);
    GxBitmap mask(1, 1, 1), dst(1, 1, 4);
    mask.pixels[0] = 128;
    GxRect rect(0, 0, 1, 1);
    GxECore::ParamPostProcessing pp{&dst, &mask, &rect, 0, nullptr};
    text.doPostProcessing(&pp);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 0, 0}));  // no property yet

    GxTextProperty red(0xFFFF0000, 0.25f);
    text.setProperty(&red);
    GxTextProperty blue(0xFF0000FF, 1.0f);
    text.setProperty(&blue);
    text.setProperty(nullptr);  // ignored
    EXPECT_NE(text.getProperty(), &blue);
    EXPECT_EQ(text.getProperty()->color, 0xFF0000FFu);

    text.doPostProcessing(&pp);  // coverage as alpha
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 128, 128}));
    std::memset(dst.pixels, 0, 4);
    pp.separateWorkImage = 1;  // coverage as a switch
    text.doPostProcessing(&pp);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 255, 255}));
    EXPECT_EQ(log.Count("Blender", "Blender - GxE_BLEND_OTHER"), 1);
    EXPECT_EQ(log.Count("Blender", "Blender - GxE_BLEND_DST_OVER_NSA"), 1);

    text.doPostProcessing(nullptr);
    pp.src = nullptr;
    text.doPostProcessing(&pp);
}

// --- the appearance key

TEST(EffectStackKey, ConcatenatesTheLayersInStackOrder) {
    GxEffect s(nullptr);
    std::unique_ptr<char[]> empty(s.getMapKey());
    ASSERT_NE(empty, nullptr);
    EXPECT_EQ(empty[0], 0);

    s.addOuterShadowText(-30, 5, 2, 0xFF000000, 1);
    s.addText(0xFF336699);
    std::unique_ptr<char[]> key(s.getMapKey());
    const std::string expected = "S\x82\xCA\x85\x82\x8F\x8F\x80\x80\x80\x80\x80\x80"
                                 "T\x8F\x8F\x83\x83\x86\x86\x89\x89";
    EXPECT_EQ(std::string(key.get()), expected);

    // With a colour: the text layer is made to carry it at the text opacity.
    s.setTextOpacity(0.5f);
    std::unique_ptr<char[]> coloured(s.getMapKey(0xFFFFFFFF));
    EXPECT_EQ(s.getTextColor(), 0xFFFFFFFFu);
    EXPECT_EQ(std::string(coloured.get()).substr(13), "T\x88\x80\x88\x80\x88\x80\x88\x80");

    GxEffect fresh(nullptr);
    std::unique_ptr<char[]> made(fresh.getMapKey(0xFF000000));
    EXPECT_EQ(std::string(made.get()), "T\x8F\x8F\x80\x80\x80\x80\x80\x80");
    EXPECT_TRUE(fresh.hasEffect(12));
}

}  // namespace
}  // namespace Glimmer
