#pragma once
// Glimmer's effects: small value types, one per effect kind, with named fields
// and their defaults. Build them with designated initialisers:
//
//   glimmer::Stroke{.size = 4, .color = 0xFF2040C0}
//   glimmer::OuterShadow{.angle = 90, .distance = 6, .size = 4, .opacity = 0.8f}
//
// Units and rules shared by every effect:
// - Colours are 0xAARRGGBB. An effect colour's alpha multiplies the effect's
//   opacity (an opaque colour leaves it as it is).
// - Sizes and distances are pixels. Values outside a field's range are clamped
//   to it (sizes and distances are also truncated to whole pixels); numbers
//   must be finite, or render() refuses the text.
// - Angles are degrees, folded into 0..359; each field says where 0 and 90
//   point.
//
// A text holds at most one effect of each kind; when a kind is given twice,
// the last one given is drawn. The stroke is one kind whatever its position.
//
// Stacking order. By default (layer style) effects stack in one fixed order,
// whatever order they were given in, bottom to top:
//   outside the glyphs: outer shadow, outer glow, stroke (outside or centre),
//                       outer bevel, emboss;
//   inside the glyphs:  the text fill, pattern, radial gradient, linear
//                       gradient, inner glow, inner shadow, stroke (inside),
//                       bevel, emboss.
// Inner effects (inside stroke, inner shadow, inner glow, inner bevel, the
// fills) never paint outside the glyphs. RenderOptions::exact switches to the
// engine's literal behaviour instead: effects stack by the order they were
// given, and inner effects may paint the whole line box.

#include <cstddef>
#include <cstdint>
#include <variant>
#include <vector>

namespace glimmer {

// 0xAARRGGBB.
using Color = std::uint32_t;

// A picture: width x height words 0xAARRGGBB, straight (not premultiplied)
// alpha, rows top to bottom.
struct Image {
    int width = 0;
    int height = 0;
    std::vector<std::uint32_t> pixels{};

    std::uint32_t at(int x, int y) const { return pixels[std::size_t(y) * std::size_t(width) + std::size_t(x)]; }
};

// One stop of a colour ramp. Positions run 0..1 and must not decrease from
// one stop to the next; the stop's opacity multiplies its colour's alpha.
struct ColorStop {
    Color color = 0xFF000000u;
    float position = 0.0f;
    float opacity = 1.0f;
};

// A blurred copy of the glyphs behind them.
struct OuterShadow {
    float angle = 120.0f;     // where the shadow falls: 0 left of the text, 90 below it
    float distance = 5.0f;    // 0..100
    float size = 5.0f;        // blur radius, 0..100
    Color color = 0xFF000000u;
    float opacity = 0.75f;    // 0..1
};

// Shades the inside of the glyphs along their edges, as if cut into the
// surface: the surroundings moved towards the angle.
struct InnerShadow {
    float angle = 120.0f;     // 0 shades the right inner edges, 90 the top ones
    float distance = 5.0f;    // 0..100
    float size = 5.0f;        // blur radius, 0..100
    Color color = 0xFF000000u;
    float opacity = 0.75f;    // 0..1
};

// A soft halo around the glyphs, in one colour or along a ramp from the edge
// outward (the ramp, when given, replaces the colour; the opacity scales it).
struct OuterGlow {
    float size = 10.0f;       // 0..100
    Color color = 0xFFFFFFBEu;
    float opacity = 0.75f;    // 0..1
    std::vector<ColorStop> stops{};
};

// Light from the glyph edges inward, in one colour or along a ramp.
struct InnerGlow {
    float size = 10.0f;       // 0..100
    Color color = 0xFFFFFFBEu;
    float opacity = 0.75f;    // 0..1
    std::vector<ColorStop> stops{};
};

enum class StrokePosition { kOutside, kCenter, kInside };

// An outline along the glyph edges.
struct Stroke {
    float size = 3.0f;        // band width, 0..100
    Color color = 0xFF000000u;
    float opacity = 1.0f;     // 0..1
    StrokePosition position = StrokePosition::kOutside;
};

// Fills the glyphs with a colour ramp along a direction.
struct LinearGradient {
    float angle = 90.0f;      // 0: the first stop on the left; 90: at the bottom
    float scale = 1.0f;       // ramp length against the text box, 0..2; below 0.1 draws nothing
    float opacity = 1.0f;     // 0..1, scales every stop
    std::vector<ColorStop> stops = {{0xFFFFFFFFu, 0.0f, 1.0f}, {0xFF000000u, 1.0f, 1.0f}};  // at least one
};

// Fills the glyphs with a colour ramp from the centre of the text box.
struct RadialGradient {
    float scale = 1.0f;       // radius against half the box width, 0..2; below 0.1 draws nothing
    float opacity = 1.0f;     // 0..1, scales every stop
    std::vector<ColorStop> stops = {{0xFFFFFFFFu, 0.0f, 1.0f}, {0xFF000000u, 1.0f, 1.0f}};  // centre first
};

// Fills the glyphs with a repeated tile.
struct Pattern {
    Image tile{};             // 1..4096 pixels a side (required)
    float scale = 1.0f;       // tile magnification, 0..10; below 0.1 draws nothing
    float opacity = 1.0f;     // 0..1
};

enum class BevelStyle { kInner, kOuter };
enum class EmbossStyle { kPlain, kTwoSided };
enum class ReliefDirection { kUp, kDown };       // down swaps the lit and shaded sides
enum class ReliefTechnique { kSmooth, kHard };   // smooth blurs the slopes, hard keeps them crisp

// Makes the glyphs look raised: lit and shaded slopes inside the glyph edges
// (inner) or outside them (outer).
struct Bevel {
    BevelStyle style = BevelStyle::kInner;
    float size = 5.0f;              // slope width
    float depth = 3.0f;             // steepness, 0..10
    ReliefDirection direction = ReliefDirection::kUp;
    ReliefTechnique technique = ReliefTechnique::kSmooth;
    int soften = 0;                 // blur radius of the result, 0..16
    float angle = 120.0f;           // direction of the light, as a shadow's angle
    float altitude = 30.0f;         // elevation of the light, degrees (folded modulo 90)
    Color highlight = 0xFFFFFFFFu;  // the lit slopes
    float highlightOpacity = 0.75f; // 0..1
    Color shadow = 0xFF000000u;     // the shaded slopes
    float shadowOpacity = 0.75f;    // 0..1
    float opacity = 1.0f;           // 0..1, scales both colours
};

// Makes the glyphs look pressed up out of the surface; two-sided lights the
// surroundings the opposite way.
struct Emboss {
    EmbossStyle style = EmbossStyle::kPlain;
    float size = 5.0f;
    float depth = 3.0f;             // 0..10
    ReliefDirection direction = ReliefDirection::kUp;
    ReliefTechnique technique = ReliefTechnique::kSmooth;
    int soften = 0;                 // 0..16
    float angle = 120.0f;
    float altitude = 30.0f;
    Color highlight = 0xFFFFFFFFu;
    float highlightOpacity = 0.75f;
    Color shadow = 0xFF000000u;
    float shadowOpacity = 0.75f;
    float opacity = 1.0f;
};

using Effect = std::variant<OuterShadow, InnerShadow, OuterGlow, InnerGlow, Stroke, LinearGradient, RadialGradient,
                            Pattern, Bevel, Emboss>;

}  // namespace glimmer
