// From public effect values to the core's effect stack.
//
// Every value reaches the stack's own operation for its kind unclamped, so
// the stack applies its clamps exactly as for any other caller. A few
// conversions on the way make the public fields mean what they say:
// - an effect colour's alpha multiplies the effect's opacity (the stack drops
//   the alpha of shadow, glow and stroke colours);
// - a layer opacity also scales every stop of a colour ramp, whose stops
//   carry their own opacities (the glow and gradient fills read only those);
// - bevel and emboss colours carry their opacities, and the layer opacity, in
//   their alpha bytes, which is all those filters read.
//
// Layer style. The stack, in its work-image mode, draws the layer added last
// on top, outside or inside the glyphs by kind. So the public stacking order
// is made by adding the effects in one canonical order, bottom first:
//   outer shadow, outer glow, stroke (outside or centre), pattern, radial
//   gradient, linear gradient, inner glow, inner shadow, stroke (inside),
//   bevel, emboss.
// The text fill is placed by the stack itself, at the bottom of what shows
// inside the glyphs.

#include "api/EffectLayers.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <string>
#include <type_traits>
#include <variant>

#include "effect/GxEffect.h"
#include "effect/GxProperty.h"
#include "foundation/GxBitmap.h"

namespace glimmer::detail {
namespace {

float Unit(float value) { return std::clamp(value, 0.0f, 1.0f); }

// The opacity with the colour's alpha folded in; untouched for an opaque
// colour, so the stack clamps it as it would any caller's.
float WithColorAlpha(float opacity, Color color) {
    const uint32_t alpha = color >> 24;
    return alpha == 255 ? opacity : Unit(opacity) * (float(alpha) / 255.0f);
}

// A colour whose alpha byte carries the opacities the relief filters would
// not otherwise read.
Color WithAlpha(Color color, float opacity) {
    const float alpha = float(color >> 24) * Unit(opacity) + 0.5f;
    return (color & 0x00FFFFFFu) | uint32_t(alpha) << 24;
}

// Stops as the stack takes them, the layer opacity folded into each one's own.
std::vector<Glimmer::GxGradient> StackStops(const std::vector<ColorStop>& stops, float layerOpacity) {
    std::vector<Glimmer::GxGradient> out;
    out.reserve(stops.size());
    for (const ColorStop& stop : stops) {
        Glimmer::GxGradient g;
        g.color = stop.color;
        float own = Unit(stop.opacity);
        if (stop.color >> 24 != 255) own *= float(stop.color >> 24) / 255.0f;
        g.opacity = own * Unit(layerOpacity);
        g.position = stop.position;
        out.push_back(g);
    }
    return out;
}

const Glimmer::GxGradient* DataOrNull(const std::vector<Glimmer::GxGradient>& stops) {
    return stops.empty() ? nullptr : stops.data();
}

// --- checks

struct Checker {
    std::string name;
    std::string problem;

    void Finite(const char* field, float value) {
        if (problem.empty() && !std::isfinite(value)) problem = name + ": " + field + " is not a finite number";
    }
    template <typename E>
    void Known(const char* field, E value, E last) {
        if (problem.empty() && (int(value) < 0 || int(value) > int(last))) {
            problem = name + ": unknown " + field + " " + std::to_string(int(value));
        }
    }
    void Stops(const std::vector<ColorStop>& stops, bool required) {
        if (!problem.empty()) return;
        if (required && stops.empty()) {
            problem = name + " needs at least one colour stop";
        } else if (stops.size() > kMaxStops) {
            problem = name + ": " + std::to_string(stops.size()) + " colour stops, at most " +
                      std::to_string(kMaxStops);
        }
        for (size_t i = 0; i < stops.size() && problem.empty(); ++i) {
            const ColorStop& stop = stops[i];
            if (!std::isfinite(stop.opacity) || !std::isfinite(stop.position)) {
                problem = name + ": stop " + std::to_string(i) + " has a number that is not finite";
            } else if (stop.position < 0.0f || stop.position > 1.0f) {
                problem = name + ": stop " + std::to_string(i) + "'s position lies outside 0..1";
            } else if (i > 0 && stop.position < stops[i - 1].position) {
                problem = name + ": stop positions must not decrease";
            }
        }
    }
    void Tile(const Image& tile) {
        if (!problem.empty()) return;
        if (tile.width < 1 || tile.height < 1) {
            problem = name + ": the tile is empty";
        } else if (tile.width > kMaxTileSide || tile.height > kMaxTileSide) {
            problem = name + ": the tile is " + std::to_string(tile.width) + "x" + std::to_string(tile.height) +
                      " pixels; at most " + std::to_string(kMaxTileSide) + " a side";
        } else if (tile.pixels.size() != size_t(tile.width) * size_t(tile.height)) {
            problem = name + ": the tile has " + std::to_string(tile.pixels.size()) + " pixels for " +
                      std::to_string(tile.width) + "x" + std::to_string(tile.height);
        }
    }
};

template <typename Relief>
void CheckRelief(const Relief& r, Checker& c) {
    for (float v : {r.size, r.depth, r.angle, r.altitude, r.highlightOpacity, r.shadowOpacity, r.opacity}) {
        c.Finite("a parameter", v);
    }
    c.Known("direction", r.direction, ReliefDirection::kDown);
    c.Known("technique", r.technique, ReliefTechnique::kHard);
}

// --- adding

struct Adder {
    Glimmer::GxEffect* stack;

    int operator()(const OuterShadow& e) const {
        return stack->addOuterShadowText(e.angle, e.distance, e.size, e.color, WithColorAlpha(e.opacity, e.color));
    }
    int operator()(const InnerShadow& e) const {
        return stack->addInnerShadowText(e.angle, e.distance, e.size, e.color, WithColorAlpha(e.opacity, e.color));
    }
    int operator()(const OuterGlow& e) const {
        const auto stops = StackStops(e.stops, e.opacity);
        return stack->addOuterGlowText(e.size, e.color, WithColorAlpha(e.opacity, e.color), int(stops.size()),
                                       DataOrNull(stops));
    }
    int operator()(const InnerGlow& e) const {
        const auto stops = StackStops(e.stops, e.opacity);
        return stack->addInnerGlowText(e.size, e.color, WithColorAlpha(e.opacity, e.color), int(stops.size()),
                                       DataOrNull(stops));
    }
    int operator()(const Stroke& e) const {
        const int position = e.position == StrokePosition::kCenter ? 0 : e.position == StrokePosition::kOutside ? 1 : 2;
        // The fourth argument is carried into the key and read by nothing.
        return stack->addStrokeText(e.size, e.color, WithColorAlpha(e.opacity, e.color), 0, position);
    }
    int operator()(const LinearGradient& e) const {
        const auto stops = StackStops(e.stops, e.opacity);
        return stack->addLinearGradientText(e.angle, e.scale, e.opacity, int(stops.size()), DataOrNull(stops));
    }
    int operator()(const RadialGradient& e) const {
        const auto stops = StackStops(e.stops, e.opacity);
        return stack->addRadialGradientText(e.scale, e.opacity, int(stops.size()), DataOrNull(stops));
    }
    int operator()(const Pattern& e) const {
        // The pattern layer reads bytes alpha, red, green, blue, straight colour.
        std::vector<unsigned char> bytes(e.tile.pixels.size() * 4);
        for (size_t i = 0; i < e.tile.pixels.size(); ++i) {
            const uint32_t c = e.tile.pixels[i];
            bytes[i * 4 + 0] = uint8_t(c >> 24);
            bytes[i * 4 + 1] = uint8_t(c >> 16);
            bytes[i * 4 + 2] = uint8_t(c >> 8);
            bytes[i * 4 + 3] = uint8_t(c);
        }
        Glimmer::GxBitmap tile(unsigned(e.tile.width), unsigned(e.tile.height), bytes.data(), 4);
        if (tile.pixels == nullptr) return -1;
        return stack->addPatternText(&tile, e.scale, e.opacity);
    }
    int operator()(const Bevel& e) const {
        return stack->addBevelText(e.style == BevelStyle::kInner ? 1 : 0, e.depth, e.size, Direction(e.direction),
                                   Technique(e.technique), e.soften, e.opacity, e.angle, e.altitude,
                                   WithAlpha(e.highlight, e.highlightOpacity * Unit(e.opacity)), e.highlightOpacity,
                                   WithAlpha(e.shadow, e.shadowOpacity * Unit(e.opacity)), e.shadowOpacity);
    }
    int operator()(const Emboss& e) const {
        return stack->addEmbossText(e.style == EmbossStyle::kTwoSided ? 3 : 0, e.depth, e.size, Direction(e.direction),
                                    Technique(e.technique), e.soften, e.opacity, e.angle, e.altitude,
                                    WithAlpha(e.highlight, e.highlightOpacity * Unit(e.opacity)), e.highlightOpacity,
                                    WithAlpha(e.shadow, e.shadowOpacity * Unit(e.opacity)), e.shadowOpacity);
    }

    static int Direction(ReliefDirection d) { return d == ReliefDirection::kUp ? 1 : 0; }
    static int Technique(ReliefTechnique t) { return t == ReliefTechnique::kHard ? 1 : 0; }
};

// Position in the layer-style order, bottom first.
int Rank(const Effect& effect) {
    struct {
        int operator()(const OuterShadow&) const { return 1; }
        int operator()(const OuterGlow&) const { return 2; }
        int operator()(const Stroke& e) const { return e.position == StrokePosition::kInside ? 9 : 3; }
        int operator()(const Pattern&) const { return 4; }
        int operator()(const RadialGradient&) const { return 5; }
        int operator()(const LinearGradient&) const { return 6; }
        int operator()(const InnerGlow&) const { return 7; }
        int operator()(const InnerShadow&) const { return 8; }
        int operator()(const Bevel&) const { return 10; }
        int operator()(const Emboss&) const { return 11; }
    } rank;
    return std::visit(rank, effect);
}

}  // namespace

const char* EffectName(const Effect& effect) {
    static const char* const kNames[] = {"outer shadow", "inner shadow",    "outer glow", "inner glow",
                                         "stroke",       "linear gradient", "radial gradient",
                                         "pattern",      "bevel",           "emboss"};
    static_assert(std::size(kNames) == std::variant_size_v<Effect>);
    return kNames[effect.index()];
}

Status CheckEffect(const Effect& effect) {
    Checker c{EffectName(effect), ""};
    std::visit(
        [&](const auto& e) {
            using T = std::decay_t<decltype(e)>;
            if constexpr (std::is_same_v<T, OuterShadow> || std::is_same_v<T, InnerShadow>) {
                for (float v : {e.angle, e.distance, e.size, e.opacity}) c.Finite("a parameter", v);
            } else if constexpr (std::is_same_v<T, OuterGlow> || std::is_same_v<T, InnerGlow>) {
                for (float v : {e.size, e.opacity}) c.Finite("a parameter", v);
                c.Stops(e.stops, false);
            } else if constexpr (std::is_same_v<T, Stroke>) {
                for (float v : {e.size, e.opacity}) c.Finite("a parameter", v);
                c.Known("position", e.position, StrokePosition::kInside);
            } else if constexpr (std::is_same_v<T, LinearGradient>) {
                for (float v : {e.angle, e.scale, e.opacity}) c.Finite("a parameter", v);
                c.Stops(e.stops, true);
            } else if constexpr (std::is_same_v<T, RadialGradient>) {
                for (float v : {e.scale, e.opacity}) c.Finite("a parameter", v);
                c.Stops(e.stops, true);
            } else if constexpr (std::is_same_v<T, Pattern>) {
                for (float v : {e.scale, e.opacity}) c.Finite("a parameter", v);
                c.Tile(e.tile);
            } else if constexpr (std::is_same_v<T, Bevel>) {
                c.Known("style", e.style, BevelStyle::kOuter);
                CheckRelief(e, c);
            } else {
                c.Known("style", e.style, EmbossStyle::kTwoSided);
                CheckRelief(e, c);
            }
        },
        effect);
    if (c.problem.empty()) return Status();
    return Status(ErrorCode::kInvalidArgument, c.problem);
}

std::vector<const Effect*> LayerStyleOrder(const std::vector<Effect>& effects) {
    std::vector<const Effect*> order;
    for (size_t i = 0; i < effects.size(); ++i) {
        bool later = false;
        for (size_t j = i + 1; j < effects.size() && !later; ++j) later = effects[j].index() == effects[i].index();
        if (!later) order.push_back(&effects[i]);
    }
    std::stable_sort(order.begin(), order.end(), [](const Effect* a, const Effect* b) { return Rank(*a) < Rank(*b); });
    return order;
}

Status AddToStack(const Effect& effect, Glimmer::GxEffect* stack) {
    if (std::visit(Adder{stack}, effect) >= 0) return Status();
    return Status(ErrorCode::kOutOfMemory, std::string("out of memory for the ") + EffectName(effect) + " layer");
}

}  // namespace glimmer::detail
