// The effect stack: ids and replacement, the add operations' conversions,
// the mode decision and render order, the mask and the text box the layers
// are given, the final merge and the key. Whole renders are pinned by the
// picture table; these are the cases a render does not single out.

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "effect/GxEffect.h"
#include "effect/GxText.h"

namespace Glimmer {
namespace {

// --- a layer that records what the stack hands it

struct Journal {
    std::vector<std::string> events;  // "init K" in call order
    std::vector<int> modes;           // the mode every init was given
    std::vector<GxRect> boxes;        // the text box every post was given
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
        journal_->modes.push_back(p->separateWorkImage);
        journal_->events.push_back("init " + std::to_string(style));
        return false;  // ignored by the stack
    }
    void render(GxECore::ParamRender*) override {}
    void doPostProcessing(GxECore::ParamPostProcessing* p) override {
        journal_->boxes.push_back(*p->textRect);
        if (paint_ && p->dst != nullptr)
            for (size_t i = 0; i < size_t(p->dst->width) * p->dst->height * 4; ++i) p->dst->pixels[i] = rgba_[i % 4];
    }
    // Paints the whole target with these bytes when post-processed.
    void Paint(std::array<uint8_t, 4> rgba) { paint_ = true, rgba_ = rgba; }
    void ReportStyle(int kind) { style = kind; }

private:
    Journal* journal_;
    GxProperty* property_ = nullptr;
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

template <typename Record>
Record* Held(GxEffect& s, int kind) {
    GxECoreBase* layer = s.getEffect(kind);
    return layer == nullptr ? nullptr : dynamic_cast<Record*>(layer->getProperty());
}

std::array<int, 4> At(const GxBitmap& b, int i) {
    const uint8_t* p = b.pixels + i * 4;
    return {p[0], p[1], p[2], p[3]};
}

std::array<int, 4> Box(const GxRect& r) { return {r.left, r.top, r.right, r.bottom}; }

// --- ids, replacement, removal, copies

TEST(EffectStackLayers, IdsReplacementRefusalAndRemoval) {
    GxEffect s(nullptr);
    EXPECT_EQ(s.addText(0xFF000000), 0);
    EXPECT_EQ(s.addOuterShadowText(0, 10, 1, 0xFF000000, 1), 1);
    EXPECT_EQ(s.addOuterShadowText(90, 20, 2, 0xFF000000, 1), 1) << "adding a kind again must replace it";
    EXPECT_EQ(Held<GxOuterShadowProperty>(s, 1)->distance, 20.0f);
    EXPECT_EQ(AddStroke(s, 2), 2) << "a replacement must take no id";
    for (int kind : {0, 9, 13, 14, -1}) {
        GxTextProperty p(0, 1);
        EXPECT_EQ(s.addEffect(kind, &p), -1) << "unknown kind " << kind << " was accepted";
    }
    s.initEffect(1, 1);
    EXPECT_TRUE(s.removeEffect(1));
    EXPECT_FALSE(s.removeEffect(1));
    EXPECT_EQ(Kinds(s.getLayers()), (std::vector<int>{12, 10}));
    EXPECT_EQ(s.getRenderOrder().size(), 2u) << "a removed layer was left to post-process";
    s.compositeLayers(nullptr);
    s.cleanAllEffect();
    EXPECT_FALSE(s.hasEffects());
    EXPECT_EQ(AddStroke(s, 1), 0) << "ids must restart after clearing";
}

TEST(EffectStackLayers, CopyHasItsOwnLayersWithTheSameIdsAndKey) {
    GxEffect original(nullptr);
    original.addOuterShadowText(0, 5, 2, 0xFF000000, 1);
    original.addStrokeText(2, 0xFF000000, 1, 0, 1);
    original.removeEffect(0);
    GxEffect copy(original);
    ASSERT_EQ(copy.getLayers().size(), 1u);
    GxECoreBase *a = copy.getLayers()[0], *b = original.getLayers()[0];
    EXPECT_TRUE(a != b && a->getProperty() != b->getProperty() && a->getId() == 1 && copy.getNewEffectId() == 2);
    std::unique_ptr<char[]> ka(original.getMapKey()), kb(copy.getMapKey());
    EXPECT_STREQ(ka.get(), kb.get());
}

// --- conversions of the add operations (the records' own clamps are in PropertyTest)

TEST(EffectStackArguments, AnglesFoldPercentsClampAndColoursPremultiply) {
    GxEffect s(nullptr);
    s.addOuterShadowText(-30.5f, 150.0f, -5.0f, 0x12FF8040, 0.5f);
    auto* shadow = Held<GxOuterShadowProperty>(s, 1);
    EXPECT_EQ((std::vector<float>{shadow->angle, shadow->distance, shadow->size}), (std::vector<float>{330, 100, 0}));
    EXPECT_EQ(shadow->color, 0x80804020u) << "alpha 0.5 * 255 + 0.5 = 128 must replace 0x12 and scale the channels";

    GxGradient stops[2] = {{0x00112233, 0.25f, 0.256f}, {0xFF445566, 7.0f, 0.999f}};
    s.addOuterGlowText(150.0f, 0x11223344, 0.5f, 2, stops);
    auto* glow = Held<GxOuterGlowProperty>(s, 3);
    ASSERT_TRUE(glow->count == 2 && glow->stops != nullptr && glow->size == 100.0f);
    EXPECT_EQ(glow->color, 0x80223344u) << "a glow keeps its RGB unscaled";
    EXPECT_EQ(glow->stops[0].color, 0x40112233u) << "a stop's alpha comes from its opacity";
    EXPECT_TRUE(glow->stops[0].position == 0.25f && glow->stops[1].position == 0.99f);
    EXPECT_EQ(stops[0].color, 0x00112233u) << "the caller's ramp was changed";
    s.addInnerGlowText(5, 0xFF000000, 1, 3, nullptr);
    EXPECT_EQ(Held<GxInnerGlowProperty>(s, 4)->count, 0) << "a count without stops must become 0";

    s.addLinearGradientText(-90.9f, 5.0f, 0.7f, 1, stops);
    s.addRadialGradientText(-1.0f, 0.3f, 1, stops);
    s.addStrokeText(7.9f, 0x00FFFFFF, 1.0f, 3, 2);
    GxBitmap tile(1, 1, 4);
    s.addPatternText(&tile, 20.0f, 1.5f);
    // The bevel's two colour opacities are clamped; its layer opacity passes as given.
    s.addBevelText(1, 4.0f, 6.0f, 1, 0, 2, 1.5f, 30.0f, 45.0f, 0xFFFFFFFF, 2.0f, 0xFF000000, -1.0f);
    auto* bevel = Held<GxBevelProperty>(s, 5);
    EXPECT_EQ((std::vector<float>{Held<GxLinearGradientProperty>(s, 7)->angle,
                                  Held<GxRadialGradientProperty>(s, 8)->scale, Held<GxStrokeProperty>(s, 10)->size,
                                  Held<GxPatternProperty>(s, 11)->scale, Held<GxPatternProperty>(s, 11)->opacity,
                                  bevel->highlightOpacity, bevel->shadowOpacity, bevel->opacity}),
              (std::vector<float>{270, 0, 7, 10, 1, 1, 0, 1.5f}));
    EXPECT_EQ(Held<GxStrokeProperty>(s, 10)->color, 0xFFFFFFFFu);

    s.addText(0x80FF0000, 0.5f);
    EXPECT_TRUE(s.getTextAlpha() == 0x80 && Held<GxTextProperty>(s, 12)->color == 0x80800000u);
    s.addText(0x40123456);
    EXPECT_TRUE(s.getTextAlpha() == 0x40 && Held<GxTextProperty>(s, 12)->color == 0xFF123456u);
}

// --- mode decision and order

TEST(EffectStackDrawing, WorkImageModeFollowsOpacityEmbossCentredStrokeAndLayerStyle) {
    const struct {
        const char* name;
        void (*build)(GxEffect&);
        int mode;
    } cases[] = {
        {"text only", [](GxEffect& s) { s.addText(0xFF000000); }, 0},
        {"text and emboss", [](GxEffect& s) { s.addText(0xFF000000); AddBevel(s, 6, 1); }, 1},
        {"centred stroke", [](GxEffect& s) { AddStroke(s, 0); }, 1},
        {"outside stroke", [](GxEffect& s) { AddStroke(s, 1); }, 0},
        {"inside bevel", [](GxEffect& s) { AddBevel(s, 5, 1); }, 0},
        {"translucent text", [](GxEffect& s) { s.addText(0xFF000000); s.setTextOpacity(0.99f); }, 1},
        {"empty", [](GxEffect&) {}, 0},
        {"layer style", [](GxEffect& s) { s.addText(0xFF000000); s.setLayerStyle(true); }, 1},
    };
    for (const auto& c : cases) {
        RecordingStack s;
        c.build(s);
        s.initEffect(3, 2);
        EXPECT_EQ(s.getSeparateWorkImage(), c.mode) << c.name << ": wrong work-image mode";
        for (int mode : s.journal.modes) EXPECT_EQ(mode, c.mode) << c.name << ": a layer was told another mode";
        s.compositeLayers(nullptr);
        EXPECT_TRUE(s.getSeparateWorkImage() == 0 && s.getSrcBitmap() == nullptr) << c.name;
    }
}

TEST(EffectStackDrawing, RenderOrderOverTextTextUnderTextOrReversedWithAWorkImage) {
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

    // An outside bevel and an outside stroke move under the text, and layers
    // are initialised in render order.
    AddBevel(s, 5, 2);
    AddStroke(s, 1);
    s.initEffect(4, 4);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{7, 4, 12, 5, 3, 10, 1}));
    EXPECT_EQ(std::vector<std::string>(s.journal.events.end() - 3, s.journal.events.end()),
              (std::vector<std::string>{"init 3", "init 10", "init 1"}));
    // Two layers reporting the text kind keep their creation order.
    s.Layer(4)->ReportStyle(12);
    s.initEffect(4, 4);
    EXPECT_EQ(s.getRenderOrder()[1], s.getLayers()[2]) << "the text group ran newest first";
    s.compositeLayers(nullptr);

    // With a work image: newest first, the text last.
    RecordingStack w;
    w.addOuterShadowText(0, 1, 1, 0xFF000000, 1);
    w.addText(0xFF000000);
    AddBevel(w, 6, 1);
    AddStroke(w, 0);
    w.addInnerGlowText(1, 0xFF000000, 1, 0, nullptr);
    w.initEffect(4, 4);
    EXPECT_EQ(Kinds(w.getRenderOrder()), (std::vector<int>{4, 10, 6, 1, 12}));
    w.compositeLayers(nullptr);
}

// --- glyphs, mask and text box

TEST(EffectStackDrawing, GlyphsUniteIntoTheMaskAndTheBoxTheLayersAreGiven) {
    RecordingStack s;
    s.addText(0xFF000000);
    unsigned char a[6] = {10, 20, 30, 40, 50, 60};  // 3 x 2
    unsigned char b[4] = {100, 5, 7, 200};          // 2 x 2
    GxGlyph ga{a, 3, 2, 0, 0}, gb{b, 2, 2, 0, 0}, line{a, 0, 3, 0, 0};
    GxBitmap dst(5, 4, 4);
    std::vector<int> mask;
    // One whole drawing of 5 x 4; the box the layers were given, or none.
    auto draw = [&](std::vector<std::pair<GxGlyph*, std::array<int, 2>>> glyphs) {
        s.journal.boxes.clear();
        s.initEffect(5, 4);
        s.setDstBitmap(&dst);
        for (auto& [glyph, at] : glyphs) s.renderEffectLayer(at[0], at[1], glyph);
        mask.assign(s.getSrcBitmap()->pixels, s.getSrcBitmap()->pixels + 20);
        s.doEffectPostProcessing();
        s.compositeLayers(&dst);
        return s.journal.boxes.empty() ? std::array<int, 4>{} : Box(s.journal.boxes.at(0));
    };
    using B = std::array<int, 4>;
    EXPECT_EQ(draw({{&ga, {0, 1}}, {&gb, {-1, 2}}}), (B{0, 1, 3, 4})) << "the box must be the glyphs' on the mask";
    // Where b's 5 meets a's 40 the larger coverage stays.
    EXPECT_EQ(mask, (std::vector<int>{0, 0, 0, 0, 0, 10, 20, 30, 0, 0, 40, 50, 60, 0, 0, 200, 0, 0, 0, 0}));
    EXPECT_EQ(draw({{&gb, {1, 1}}, {&line, {4, 0}}}), (B{1, 0, 4, 3})) << "a zero-sized glyph must widen the box";
    EXPECT_EQ(draw({}), (B{1, 0, 4, 3})) << "a drawing without glyphs must keep the last box";
    EXPECT_EQ(draw({{&gb, {10, 1}}}), (B{})) << "a layer was called for a box off the mask";
}

// The same two rules with a real stroke, on the bytes they change: an inside
// stroke (size 1) over the text reaches the corner only from the right box.
TEST(EffectStackDrawing, BoxRulesDecideTheStrokedCorner) {
    unsigned char full[4] = {255, 255, 255, 255};
    GxGlyph square{full, 2, 2, 0, 0}, line{full, 0, 3, 0, 0};
    GxEffect s(nullptr);
    s.addStrokeText(1, 0xFF0000FF, 1, 0, 2);
    s.addText(0xFF000000);
    auto draw = [&](GxBitmap& dst, std::vector<std::pair<GxGlyph*, std::array<int, 2>>> glyphs) {
        std::memset(dst.pixels, 0, size_t(dst.width) * dst.height * 4);
        s.initEffect(dst.width, dst.height);
        s.setDstBitmap(&dst);
        for (auto& [glyph, at] : glyphs) s.renderEffectLayer(at[0], at[1], glyph);
        s.doEffectPostProcessing();
        const std::array<int, 4> box = Box(*s.getTextRect());
        s.compositeLayers(&dst);
        return box;
    };
    using B = std::array<int, 4>;
    GxBitmap wide(8, 5, 4), narrow(6, 5, 4);
    EXPECT_EQ(draw(wide, {{&square, {2, 2}}, {&line, {6, 1}}}), (B{2, 1, 6, 4}));
    EXPECT_EQ(At(wide, 0)[3], 255) << "the 0x3 glyph's box must let the stroke cover the corner (a 2x2 box gives 149)";
    EXPECT_EQ(draw(narrow, {{&square, {2, 2}}}), (B{2, 2, 4, 4}));
    EXPECT_EQ(draw(narrow, {}), (B{2, 2, 4, 4})) << "a drawing without glyphs keeps the last box";
    EXPECT_EQ(At(narrow, 0)[2], 255) << "and strokes from it over the empty mask";
}

// --- the final merge

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
    s.compositeLayers(&dst);
    // m = 0 the work pixel, m = 255 the destination, m = 128 a mix
    // (105, 60, 40, 148); then straight colour.
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{64, 128, 192, 40}));
    EXPECT_EQ(At(dst, 1), (std::array<int, 4>{200, 100, 50, 255}));
    EXPECT_EQ(At(dst, 2), (std::array<int, 4>{181, 103, 69, 148}));
    EXPECT_TRUE(s.getSrcBitmap() == nullptr && s.getDstBitmap() == nullptr);
}

TEST(EffectStackComposite, TextLayerOverAGlyphAtTheMasksRightEdge) {
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
        EXPECT_EQ(At(dst, 2), (std::array<int, 4>{0, 0, 255, 128})) << "the mask's last column was not drawn";
        EXPECT_EQ(At(dst, 5), (std::array<int, 4>{0, 0, 255, 1})) << "alpha 1 must keep its full colour";
    }
}

// --- the appearance key

TEST(EffectStackKey, ConcatenatesTheLayersAndCarriesTheTextColour) {
    GxEffect s(nullptr);
    s.addOuterShadowText(-30, 5, 2, 0xFF000000, 1);
    s.setTextOpacity(0.5f);
    // The text layer is made to carry the colour at the text opacity.
    std::unique_ptr<char[]> key(s.getMapKey(0xFFFFFFFF));
    EXPECT_EQ(std::string(key.get()), "S\x82\xCA\x85\x82\x8F\x8F\x80\x80\x80\x80\x80\x80"
                                      "T\x88\x80\x88\x80\x88\x80\x88\x80");
    EXPECT_TRUE(s.hasEffect(12) && s.getTextColor() == 0xFFFFFFFFu);
}

}  // namespace
}  // namespace Glimmer
