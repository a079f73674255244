// The effect stack through the whole drawing protocol: layers of every kind
// added with hostile numbers and counts (replaced, removed), then one or two
// drawings of random glyph masks at random places on a random surface, as
// the glyph drawing hands them over.

#include <cstdint>
#include <memory>
#include <vector>

#include "FuzzInput.h"
#include "effect/GxEffect.h"
#include "foundation/GxBitmap.h"

namespace {

using Glimmer::GxBitmap;
using Glimmer::GxEffect;
using Glimmer::GxGlyph;
using Glimmer::GxGradient;
using Glimmer::Fuzz::Input;

// Stops for a ramp: `count` as the caller claims it, an array that holds
// max(count, 0) entries up to a cap (a larger claim gets no array: a caller
// that lies about its array's length is not the library's to survive).
struct Stops {
    int count = 0;
    std::vector<GxGradient> stops;
    const GxGradient* get() const { return stops.empty() ? nullptr : stops.data(); }
};

Stops ReadStops(Input& in) {
    Stops s;
    s.count = in.Count();
    if (s.count > 0 && s.count <= 300) {
        s.stops.resize(size_t(s.count));
        for (GxGradient& stop : s.stops) {
            stop.color = in.U32();
            stop.opacity = in.Float();
            stop.position = in.Float();
        }
    }
    return s;
}

void AddLayer(GxEffect& stack, Input& in) {
    switch (in.Below(13)) {
        case 0: stack.addOuterShadowText(in.Float(), in.Float(), in.Float(), in.U32(), in.Float()); break;
        case 1: stack.addInnerShadowText(in.Float(), in.Float(), in.Float(), in.U32(), in.Float()); break;
        case 2: {
            const float size = in.Float(), opacity = in.Float();
            const uint32_t color = in.U32();
            const Stops s = ReadStops(in);
            stack.addOuterGlowText(size, color, opacity, s.count, s.get());
            break;
        }
        case 3: {
            const float size = in.Float(), opacity = in.Float();
            const uint32_t color = in.U32();
            const Stops s = ReadStops(in);
            stack.addInnerGlowText(size, color, opacity, s.count, s.get());
            break;
        }
        case 4:
        case 5: {
            const int style = in.Count(), direction = in.Count(), technique = in.Count(), soften = in.Count();
            const float depth = in.Float(), size = in.Float(), opacity = in.Float(), angle = in.Float(),
                        altitude = in.Float(), highlightOpacity = in.Float(), shadowOpacity = in.Float();
            const uint32_t highlight = in.U32(), shadow = in.U32();
            if (in.Bool()) {
                stack.addBevelText(style, depth, size, direction, technique, soften, opacity, angle, altitude,
                                   highlight, highlightOpacity, shadow, shadowOpacity);
            } else {
                stack.addEmbossText(style, depth, size, direction, technique, soften, opacity, angle, altitude,
                                    highlight, highlightOpacity, shadow, shadowOpacity);
            }
            break;
        }
        case 6: {
            const float angle = in.Float(), scale = in.Float(), opacity = in.Float();
            const Stops s = ReadStops(in);
            stack.addLinearGradientText(angle, scale, opacity, s.count, s.get());
            break;
        }
        case 7: {
            const float scale = in.Float(), opacity = in.Float();
            const Stops s = ReadStops(in);
            stack.addRadialGradientText(scale, opacity, s.count, s.get());
            break;
        }
        case 8: stack.addStrokeText(in.Float(), in.U32(), in.Float(), in.Count(), in.Count()); break;
        case 9: {
            const int w = in.Below(9), h = in.Below(9);   // 0 x 0 tiles too
            GxBitmap tile(unsigned(w), unsigned(h), 4);
            for (int i = 0; tile.pixels != nullptr && i < w * h * 4; ++i) tile.pixels[i] = in.Byte();
            const float scale = in.Float(), opacity = in.Float();
            stack.addPatternText(in.Below(8) == 0 ? nullptr : &tile, scale, opacity);
            break;
        }
        case 10: stack.addText(in.U32(), in.Float()); break;
        case 11: stack.removeEffect(in.Count()); break;
        default: stack.setTextOpacity(in.Float()); break;
    }
}

struct Glyph {
    std::unique_ptr<unsigned char[]> buffer;
    GxGlyph glyph;
    int x = 0, y = 0;
};

// Draws once on a surface of the stack's margins around a random box.
void Draw(GxEffect& stack, Input& in) {
    const int64_t width = int64_t(in.Below(96)) + stack.getLeftOffset() + stack.getRightOffset();
    const int64_t height = int64_t(in.Below(64)) + stack.getTopOffset() + stack.getBottomOffset();
    if (width > 1024 || height > 1024) return;   // margins of 100 px on every side fit
    std::vector<Glyph> glyphs(size_t(in.Below(4)));
    for (Glyph& g : glyphs) {
        const int w = in.Below(40), h = in.Below(40);
        g.buffer.reset(new unsigned char[size_t(w * h) + 1]);
        const uint8_t fill = in.Byte();
        for (int i = 0; i < w * h; ++i) g.buffer[size_t(i)] = (fill & 1) != 0 ? in.Byte() : fill;
        g.glyph = GxGlyph{w * h > 0 || in.Bool() ? g.buffer.get() : nullptr, uint16_t(w), uint16_t(h),
                          int32_t(in.Below(80)) - 20, int32_t(in.Below(80)) - 20};
        g.x = int(in.Below(200)) - 50;
        g.y = int(in.Below(200)) - 50;
    }
    GxBitmap dst(unsigned(width), unsigned(height), 4);
    stack.setWordOrderOutput(in.Bool());
    stack.initEffect(int(width), int(height));
    stack.setDstBitmap(&dst);
    for (Glyph& g : glyphs) stack.renderEffectLayer(g.x, g.y, &g.glyph);
    stack.doEffectPostProcessing();
    stack.compositeLayers(&dst);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Input in(data, size);
    GxEffect stack(nullptr);
    stack.setLayerStyle(in.Bool());
    const int layers = in.Below(12);
    for (int i = 0; i < layers; ++i) AddLayer(stack, in);
    delete[] stack.getMapKey(in.U32());
    Draw(stack, in);
    if (in.Bool()) {   // a second drawing reuses the kept memory, perhaps at another size
        for (int i = in.Below(3); i > 0; --i) AddLayer(stack, in);
        Draw(stack, in);
    }
    if (in.Bool()) {
        GxEffect copy(stack);
        Draw(copy, in);
    }
    return 0;
}
