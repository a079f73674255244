// The effect stack: ids and replacement, the add operations' conversions,
// margins, the mode decision and render order, the mask and text box, the
// final merge, the text layer and the key. Whole renders are pinned by the
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
    std::vector<std::string> events;  // "init K" and "post K" in call order
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
        journal_->events.push_back("post " + std::to_string(style));
        if (paint_ && p->dst != nullptr)
            for (size_t i = 0; i < size_t(p->dst->width) * p->dst->height * 4; ++i) p->dst->pixels[i] = rgba_[i % 4];
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

TEST(EffectStackLayers, TextOpacityAloneCountsAndIsClamped) {
    GxEffect s(nullptr);
    s.setTextOpacity(0.5f);
    EXPECT_TRUE(s.hasEffects());
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
        EXPECT_TRUE(a != b && a->getProperty() != b->getProperty() && a->getId() == b->getId()) << i;
    }
    EXPECT_TRUE(copy.getTextOpacity() == 0.25f && copy.getTextAlpha() == 0x80 && copy.getNewEffectId() == 3);
    std::unique_ptr<char[]> a(original.getMapKey()), b(copy.getMapKey());
    EXPECT_STREQ(a.get(), b.get());
}

// --- conversions of the add operations (the records' own clamps are in PropertyTest)

TEST(EffectStackArguments, AnglesFoldPercentsClampAndColoursPremultiply) {
    GxEffect s(nullptr);
    s.addOuterShadowText(-30.5f, 150.0f, -5.0f, 0x12FF8040, 0.5f);
    auto* p = Held<GxOuterShadowProperty>(s, 1);
    ASSERT_NE(p, nullptr);
    EXPECT_EQ((std::vector<float>{p->angle, p->distance, p->size}), (std::vector<float>{330.0f, 100.0f, 0.0f}));
    EXPECT_EQ(p->color, 0x80804020u) << "alpha 0.5 * 255 + 0.5 = 128 must replace 0x12 and scale the channels";
    s.addInnerShadowText(0, 7.9f, 0, 0xFFFFFFFF, -1.0f);
    EXPECT_EQ(Held<GxInnerShadowProperty>(s, 2)->distance, 7.0f);
    EXPECT_EQ(Held<GxInnerShadowProperty>(s, 2)->color, 0u);

    GxGradient stops[2] = {{0x00112233, 0.25f, 0.256f}, {0xFF445566, 7.0f, 0.999f}};
    s.addOuterGlowText(150.0f, 0x11223344, 0.5f, 2, stops);
    auto* glow = Held<GxOuterGlowProperty>(s, 3);
    ASSERT_TRUE(glow != nullptr && glow->count == 2 && glow->stops != nullptr);
    EXPECT_EQ(glow->size, 100.0f);
    EXPECT_EQ(glow->color, 0x80223344u) << "a glow keeps its RGB unscaled";
    EXPECT_EQ(glow->stops[0].color, 0x40112233u) << "a stop's alpha comes from its opacity";
    EXPECT_TRUE(glow->stops[0].position == 0.25f && glow->stops[1].position == 0.99f);
    EXPECT_EQ(stops[0].color, 0x00112233u) << "the caller's ramp was changed";
    s.addInnerGlowText(5, 0xFF000000, 1, 3, nullptr);
    EXPECT_EQ(Held<GxInnerGlowProperty>(s, 4)->count, 0) << "a count without stops must become 0";

    s.addLinearGradientText(-90.9f, 5.0f, 0.7f, 1, stops);
    EXPECT_EQ(Held<GxLinearGradientProperty>(s, 7)->angle, 270.0f);
    s.addRadialGradientText(-1.0f, 0.3f, 1, stops);
    EXPECT_EQ(Held<GxRadialGradientProperty>(s, 8)->scale, 0.0f);
    s.addStrokeText(7.9f, 0x00FFFFFF, 1.0f, 3, 2);
    EXPECT_EQ(Held<GxStrokeProperty>(s, 10)->size, 7.0f);
    EXPECT_EQ(Held<GxStrokeProperty>(s, 10)->color, 0xFFFFFFFFu);
    GxBitmap tile(1, 1, 4);
    s.addPatternText(&tile, 20.0f, 1.5f);
    EXPECT_TRUE(Held<GxPatternProperty>(s, 11)->scale == 10.0f && Held<GxPatternProperty>(s, 11)->opacity == 1.0f);
    // The two colour opacities are clamped; the layer opacity passes as given.
    s.addBevelText(1, 4.0f, 6.0f, 1, 0, 2, 1.5f, 30.0f, 45.0f, 0xFFFFFFFF, 2.0f, 0xFF000000, -1.0f);
    auto* bevel = Held<GxBevelProperty>(s, 5);
    EXPECT_EQ((std::vector<float>{bevel->highlightOpacity, bevel->shadowOpacity, bevel->opacity}),
              (std::vector<float>{1.0f, 0.0f, 1.5f}));

    s.addText(0x80FF0000, 0.5f);
    EXPECT_TRUE(s.getTextAlpha() == 0x80 && Held<GxTextProperty>(s, 12)->color == 0x80800000u);
    s.addText(0x40123456);
    EXPECT_TRUE(s.getTextAlpha() == 0x40 && Held<GxTextProperty>(s, 12)->color == 0xFF123456u);
}

// --- margins, mode decision and order

TEST(EffectStackMargins, EachSideIsTheLargestOverTheLayersAndTheTopNeverNegative) {
    RecordingStack s;
    s.addText(0xFF000000);
    AddStroke(s, 1);
    s.Layer(12)->SetOffsets(3, 1, -9, 7);
    s.Layer(10)->SetOffsets(2, 5, -4, 1);
    EXPECT_EQ((std::vector<int>{s.getLeftOffset(), s.getRightOffset(), s.getTopOffset(), s.getBottomOffset()}),
              (std::vector<int>{3, 5, 0, 7}));
}

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
}

TEST(EffectStackDrawing, WorkImageModeRunsReversedWithTextLast) {
    RecordingStack s;
    s.addOuterShadowText(0, 1, 1, 0xFF000000, 1);
    s.addText(0xFF000000);
    AddBevel(s, 6, 1);
    AddStroke(s, 0);
    s.addInnerGlowText(1, 0xFF000000, 1, 0, nullptr);
    s.initEffect(4, 4);
    EXPECT_EQ(Kinds(s.getRenderOrder()), (std::vector<int>{4, 10, 6, 1, 12}));
    s.compositeLayers(nullptr);
}

// --- glyphs, mask and text box

TEST(EffectStackDrawing, GlyphsUniteIntoTheMaskAndTheBoxIsClampedToIt) {
    RecordingStack s;
    s.addText(0xFF000000);
    unsigned char a[6] = {10, 20, 30, 40, 50, 60};  // 3 x 2
    unsigned char b[4] = {100, 5, 7, 200};          // 2 x 2
    GxGlyph ga{a, 3, 2, 0, 0}, gb{b, 2, 2, 0, 0};
    GxBitmap dst(5, 4, 4);
    s.initEffect(5, 4);
    s.setDstBitmap(&dst);
    s.renderEffectLayer(0, 1, &ga);
    s.renderEffectLayer(-1, 2, &gb);
    EXPECT_EQ(Box(*s.getTextRect()), (std::array<int, 4>{-1, 1, 3, 4}));
    const unsigned char* m = s.getSrcBitmap()->pixels;
    // Rows 1 to 3; where b's 5 meets a's 40 the larger coverage stays.
    EXPECT_EQ(std::vector<int>(m + 5, m + 20),
              (std::vector<int>{10, 20, 30, 0, 0, 40, 50, 60, 0, 0, 200, 0, 0, 0, 0}));
    s.doEffectPostProcessing();
    ASSERT_EQ(s.journal.boxes.size(), 1u);
    EXPECT_EQ(Box(s.journal.boxes[0]), (std::array<int, 4>{0, 1, 3, 4})) << "the layers' box must lie on the mask";
    s.compositeLayers(&dst);

    // The next drawing starts a new box with its first glyph.
    s.initEffect(5, 4);
    s.renderEffectLayer(3, 3, &gb);
    EXPECT_EQ(Box(*s.getTextRect()), (std::array<int, 4>{3, 3, 5, 5}));
    s.doEffectPostProcessing();
    s.compositeLayers(nullptr);
    s.journal.boxes.clear();
    s.initEffect(5, 4);
    s.renderEffectLayer(10, 1, &gb);
    s.doEffectPostProcessing();
    s.compositeLayers(&dst);
    EXPECT_TRUE(s.journal.boxes.empty()) << "a layer was called for a box off the mask";
}

// An inside stroke paints everything outside the glyphs, so its reach shows
// which text box the layers were given.
TEST(EffectStackDrawing, ZeroSizedGlyphsWidenTheBoxAndEmptyDrawingsReuseIt) {
    unsigned char full[4] = {255, 255, 255, 255};
    GxGlyph square{full, 2, 2, 0, 0}, line{full, 0, 3, 0, 0};
    GxEffect s(nullptr);
    s.addStrokeText(1, 0xFF0000FF, 1, 0, 2);
    s.addText(0xFF000000);
    GxBitmap dst(8, 5, 4);
    auto draw = [&](std::vector<std::pair<GxGlyph*, std::array<int, 2>>> glyphs) {
        std::memset(dst.pixels, 0, 8 * 5 * 4);
        s.initEffect(8, 5);
        s.setDstBitmap(&dst);
        for (auto& [glyph, at] : glyphs) s.renderEffectLayer(at[0], at[1], glyph);
        s.doEffectPostProcessing();
        const std::array<int, 4> box = Box(*s.getTextRect());
        s.compositeLayers(&dst);
        return box;
    };
    EXPECT_EQ(draw({{&square, {2, 2}}, {&line, {6, 1}}}), (std::array<int, 4>{2, 1, 6, 4}));
    EXPECT_EQ(At(dst, 0)[3], 255) << "a 2x2 box would leave the corner partly covered";
    EXPECT_EQ(draw({{&square, {2, 2}}}), (std::array<int, 4>{2, 2, 4, 4}));
    EXPECT_EQ(draw({}), (std::array<int, 4>{2, 2, 4, 4})) << "a drawing without glyphs keeps the last box";
    EXPECT_EQ(At(dst, 0)[2], 255) << "and the stroke reaches from it over the empty mask";
}

// --- the final merge

TEST(EffectStackComposite, StraightColourWithTheTextAlpha) {
    const uint8_t before[16] = {64, 64, 64, 128, 255, 255, 255, 255, 100, 50, 0, 0, 9, 9, 9, 1};
    const struct {
        unsigned text;
        std::array<int, 4> px[4];
    } cases[] = {
        {0xFF000000, {{128, 128, 128, 128}, {255, 255, 255, 255}, {0, 0, 0, 0}, {255, 255, 255, 1}}},
        // Text alpha 0x80 scales alpha; alpha 1 survives and saturates the colour.
        {0x80000000, {{128, 128, 128, 64}, {255, 255, 255, 128}, {0, 0, 0, 0}, {255, 255, 255, 1}}},
    };
    for (const auto& c : cases) {
        GxEffect s(nullptr);
        s.addText(c.text);
        GxBitmap dst(4, 1, 4);
        std::memcpy(dst.pixels, before, 16);
        s.initEffect(4, 1);
        s.compositeLayers(&dst);
        for (int i = 0; i < 4; ++i) EXPECT_EQ(At(dst, i), c.px[i]) << "text " << std::hex << c.text << " pixel " << i;
    }
    GxEffect s(nullptr);
    GxBitmap opaque(256, 1, 4);
    for (int v = 0; v < 256; ++v) {
        uint8_t* p = opaque.pixels + v * 4;
        p[0] = uint8_t(v), p[1] = uint8_t(255 - v), p[2] = uint8_t(v / 3), p[3] = 255;
    }
    s.initEffect(256, 1);
    s.compositeLayers(&opaque);
    for (int v = 0; v < 256; ++v)
        ASSERT_EQ(At(opaque, v), (std::array<int, 4>{v, 255 - v, v / 3, 255})) << "an opaque pixel changed: " << v;
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
        EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 0, 0}));
        EXPECT_EQ(At(dst, 2), (std::array<int, 4>{0, 0, 255, 128})) << "the mask's last column was not drawn";
        EXPECT_EQ(At(dst, 4), (std::array<int, 4>{0, 0, 255, 255}));
        EXPECT_EQ(At(dst, 5), (std::array<int, 4>{0, 0, 255, 1}));
    }
}

TEST(TextLayer, DrawsOnlyWithARecordCoverageAsAlphaOrAsASwitch) {
    GxText text;
    GxBitmap mask(1, 1, 1), dst(1, 1, 4);
    mask.pixels[0] = 128;
    GxRect rect(0, 0, 1, 1);
    GxECore::ParamPostProcessing pp{&dst, &mask, &rect, 0, nullptr};
    text.doPostProcessing(&pp);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 0, 0})) << "drew without a record";
    GxTextProperty blue(0xFF0000FF, 1.0f);
    text.setProperty(&blue);
    text.setProperty(nullptr);  // ignored
    EXPECT_NE(text.getProperty(), &blue);
    text.doPostProcessing(&pp);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 128, 128}));
    std::memset(dst.pixels, 0, 4);
    pp.separateWorkImage = 1;
    text.doPostProcessing(&pp);
    EXPECT_EQ(At(dst, 0), (std::array<int, 4>{0, 0, 255, 255}));
}

// --- the appearance key

TEST(EffectStackKey, ConcatenatesTheLayersAndCanCarryAColour) {
    GxEffect s(nullptr);
    std::unique_ptr<char[]> empty(s.getMapKey());
    ASSERT_TRUE(empty != nullptr && empty[0] == 0);
    s.addOuterShadowText(-30, 5, 2, 0xFF000000, 1);
    s.addText(0xFF336699);
    std::unique_ptr<char[]> key(s.getMapKey());
    EXPECT_EQ(std::string(key.get()), "S\x82\xCA\x85\x82\x8F\x8F\x80\x80\x80\x80\x80\x80"
                                      "T\x8F\x8F\x83\x83\x86\x86\x89\x89");
    // With a colour the text layer carries it at the text opacity, and is
    // made if missing.
    s.setTextOpacity(0.5f);
    std::unique_ptr<char[]> coloured(s.getMapKey(0xFFFFFFFF));
    EXPECT_EQ(std::string(coloured.get()).substr(13), "T\x88\x80\x88\x80\x88\x80\x88\x80");
    GxEffect fresh(nullptr);
    std::unique_ptr<char[]> made(fresh.getMapKey(0xFF000000));
    EXPECT_TRUE(fresh.hasEffect(12) && std::string(made.get()) == "T\x8F\x8F\x80\x80\x80\x80\x80\x80");
}

}  // namespace
}  // namespace Glimmer
