// The effect catalogue and how each entry reaches the effect stack.
//
// Every value goes to the stack's own operation for its kind, unclamped, so
// the stack applies its clamps exactly as it does for a device caller (the
// help text states them). Three conveniences sit on top, each because the
// stack would otherwise ignore what a user obviously meant:
// - a layer opacity also scales every stop of a colour ramp (the glow and
//   gradient fills read only the stops' own opacities);
// - bevel and emboss colours carry their opacity, and the layer opacity, in
//   their alpha byte (those filters read only the alpha bytes);
// - "highlight" is the colour of the slopes that face the light on a raised
//   glyph, "shadow" that of the others, as the records name them.

#include "Effects.h"

#include <algorithm>
#include <cmath>
#include <memory>

#include <nlohmann/json.hpp>

#include "Png.h"
#include "Values.h"
#include "effect/GxECoreBase.h"
#include "effect/GxEffect.h"
#include "foundation/GxBitmap.h"
#include "text/GxTextObject.h"

namespace Glimmer::RenderTool {
namespace {

// A pattern tile larger than this is surely a mistake (and a large copy per layer).
constexpr int kMaxTileSide = 4096;

constexpr const char* kAngleHelp = "degrees, any value (folded into 0..359)";
constexpr const char* kOpacityHelp = "0..1 (clamped)";
constexpr const char* kPercentHelp = "pixels, 0..100 (truncated and clamped)";

std::vector<ParamSpec> ShadowParams() {
    return {
        {"angle", ParamType::kNumber, "120", kAngleHelp},
        {"distance", ParamType::kNumber, "5", kPercentHelp},
        {"size", ParamType::kNumber, "5", "blur radius in pixels, 0..100 (truncated and clamped)"},
        {"color", ParamType::kColor, "#000000", "the colour's own alpha is ignored; use opacity"},
        {"opacity", ParamType::kNumber, "0.75", kOpacityHelp},
    };
}

std::vector<ParamSpec> GlowParams() {
    return {
        {"size", ParamType::kNumber, "10", kPercentHelp},
        {"color", ParamType::kColor, "#FFFFBE", "used when there are no stops"},
        {"opacity", ParamType::kNumber, "0.75", "0..1 (clamped); also scales every stop"},
        {"stops", ParamType::kStops, "", "optional colour ramp from the edge outward"},
    };
}

std::vector<ParamSpec> ReliefParams(bool emboss) {
    std::vector<ParamSpec> params;
    if (emboss) {
        params.push_back({"style", ParamType::kChoice, "plain", "two-sided lights the surroundings oppositely",
                          {{"plain", 0}, {"two-sided", 3}}});
    } else {
        params.push_back({"style", ParamType::kChoice, "inner", "inside or outside the glyph edges",
                          {{"inner", 1}, {"outer", 0}}});
    }
    params.push_back({"size", ParamType::kNumber, "5", "pixels"});
    params.push_back({"depth", ParamType::kNumber, "3", "steepness, 0..10 (clamped)"});
    params.push_back({"direction", ParamType::kChoice, "up", "down swaps the lit and shaded sides",
                      {{"up", 1}, {"down", 0}}});
    params.push_back({"technique", ParamType::kChoice, "smooth", "smooth blurs the slopes, hard keeps them crisp",
                      {{"smooth", 0}, {"hard", 1}}});
    params.push_back({"soften", ParamType::kNumber, "0", "blur radius of the result, 0..16 (clamped)"});
    params.push_back({"angle", ParamType::kNumber, "120", "light direction in degrees (folded modulo 360)"});
    params.push_back({"altitude", ParamType::kNumber, "30", "light elevation in degrees (folded modulo 90)"});
    params.push_back({"highlight", ParamType::kColor, "#FFFFFF", "colour of the lit slopes"});
    params.push_back({"highlight-opacity", ParamType::kNumber, "0.75", kOpacityHelp});
    params.push_back({"shadow", ParamType::kColor, "#000000", "colour of the shaded slopes"});
    params.push_back({"shadow-opacity", ParamType::kNumber, "0.75", kOpacityHelp});
    params.push_back({"opacity", ParamType::kNumber, "1", "0..1 (clamped); scales both colours"});
    return params;
}

std::vector<EffectSpec> BuildCatalog() {
    const std::vector<ParamSpec> glow = GlowParams();
    std::vector<EffectSpec> catalog = {
        {"outer-shadow", {"shadow", "drop-shadow"}, GxECore::kOuterShadow,
         "a blurred copy of the text behind it; angle 0 casts it to the left, 90 down",
         ShadowParams()},
        {"inner-shadow", {}, GxECore::kInnerShadow,
         "darkens the inside of the glyphs along the edges facing away from the light", ShadowParams()},
        {"outer-glow", {"glow"}, GxECore::kOuterGlow, "a soft halo around the glyphs", glow},
        {"inner-glow", {}, GxECore::kInnerGlow, "lights the glyphs from their edges inward", glow},
        {"stroke", {"outline"}, GxECore::kStroke, "an outline along the glyph edges",
         {
             {"size", ParamType::kNumber, "3", "width in pixels, 0..100 (truncated and clamped)"},
             {"color", ParamType::kColor, "#000000", "the colour's own alpha is ignored; use opacity"},
             {"opacity", ParamType::kNumber, "1", kOpacityHelp},
             {"position", ParamType::kChoice, "outside", "where the band lies against the edge",
              {{"outside", 1}, {"center", 0}, {"centre", 0}, {"inside", 2}}},
         }},
        {"linear-gradient", {"gradient"}, GxECore::kLinearGradient, "fills the glyphs with a colour ramp",
         {
             {"angle", ParamType::kNumber, "90", "degrees (folded into 0..359); 0 runs from the first stop on the left, 90 from the bottom"},
             {"scale", ParamType::kNumber, "1", "length of the ramp against the text box, 0..2 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", "0..1; scales every stop"},
             {"stops", ParamType::kStops, "#FFFFFF/#000000", "the colour ramp"},
         }},
        {"radial-gradient", {"radial"}, GxECore::kRadialGradient,
         "fills the glyphs with a ramp from the centre of the text box",
         {
             {"scale", ParamType::kNumber, "1", "radius against half the box width, 0..2 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", "0..1; scales every stop"},
             {"stops", ParamType::kStops, "#FFFFFF/#000000", "the colour ramp, centre first"},
         }},
        {"pattern", {}, GxECore::kPattern, "fills the glyphs with a repeated PNG tile",
         {
             {"tile", ParamType::kFile, "", "PNG file (required)"},
             {"scale", ParamType::kNumber, "1", "tile magnification, 0..10 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", kOpacityHelp},
         }},
        {"bevel", {}, GxECore::kBevel, "makes the glyphs look raised", ReliefParams(false)},
        {"emboss", {}, GxECore::kEmboss, "makes the glyphs look pressed up out of the surface",
         ReliefParams(true)},
        {"text", {"fill"}, GxECore::kText, "the glyphs themselves",
         {
             {"color", ParamType::kColor, "#000000",
              "the text colour; its alpha fades the whole picture, effects included"},
             {"opacity", ParamType::kNumber, "1",
              "0..1 (clamped); below 1 the layers are merged through a separate work image"},
         }},
    };
    return catalog;
}

std::string ParamNames(const EffectSpec& spec) {
    std::string names;
    for (const ParamSpec& p : spec.params) {
        if (!names.empty()) names += ", ";
        names += p.name;
    }
    return names;
}

std::string ChoiceNames(const ParamSpec& param) {
    std::string names;
    for (const Choice& c : param.choices) {
        if (!names.empty()) names += ", ";
        names += c.name;
    }
    return names;
}

size_t ParamIndex(const EffectSpec& spec, std::string_view name) {
    std::string wanted(name);
    if (wanted == "colour") wanted = "color";
    for (size_t i = 0; i < spec.params.size(); ++i) {
        if (wanted == spec.params[i].name) return i;
    }
    throw UsageError(std::string(spec.name) + ": unknown parameter " + Quote(name) + " (valid: " +
                     ParamNames(spec) + ")");
}

// Reads one parameter from its typed form.
void SetValue(const EffectSpec& spec, const ParamSpec& param, std::string_view text, ParamValue* out,
              const std::string& baseDir) {
    const std::string what = std::string(spec.name) + " " + param.name;
    switch (param.type) {
        case ParamType::kNumber:
            out->number = ParseNumber(text, what);
            return;
        case ParamType::kColor:
            out->color = ParseColor(text, what);
            return;
        case ParamType::kStops:
            out->stops = ParseStops(text, what);
            return;
        case ParamType::kFile:
            out->path = std::string(text);
            if (!out->path.empty() && out->path.front() != '/' && !baseDir.empty()) {
                out->path = baseDir + "/" + out->path;
            }
            return;
        case ParamType::kChoice:
            for (const Choice& c : param.choices) {
                if (text == c.name) {
                    out->choice = c.value;
                    return;
                }
            }
            throw UsageError(what + ": " + Quote(text) + " is not one of " + ChoiceNames(param));
    }
}

EffectRequest Defaults(const EffectSpec& spec) {
    EffectRequest request;
    request.spec = &spec;
    request.values.resize(spec.params.size());
    for (size_t i = 0; i < spec.params.size(); ++i) {
        const ParamSpec& p = spec.params[i];
        if (p.defaultValue[0] != 0) SetValue(spec, p, p.defaultValue, &request.values[i], "");
    }
    return request;
}

const EffectSpec& RequireEffect(std::string_view name) {
    const EffectSpec* spec = FindEffect(name);
    if (spec == nullptr) {
        throw UsageError("unknown effect " + Quote(name) + " (valid: " + EffectNames() + ")");
    }
    return *spec;
}

void CheckComplete(const EffectRequest& request) {
    for (size_t i = 0; i < request.spec->params.size(); ++i) {
        const ParamSpec& p = request.spec->params[i];
        if (p.type == ParamType::kFile && request.values[i].path.empty() && request.values[i].image.pixels.empty()) {
            throw UsageError(std::string(request.spec->name) + " needs " + p.name + "=FILE");
        }
    }
}

float Unit(float value) { return std::clamp(value, 0.0f, 1.0f); }

// Integer arguments of the stack from typed numbers, kept where a conversion is defined.
int WholeNumber(float value) { return int(std::clamp(value, -1.0e6f, 1.0e6f)); }

// Stops with the layer opacity folded into each one's own.
std::vector<GxGradient> ScaledStops(std::vector<GxGradient> stops, float opacity) {
    for (GxGradient& stop : stops) stop.opacity = Unit(stop.opacity) * Unit(opacity);
    return stops;
}

// A colour whose alpha byte carries the opacities the relief filters would not read.
uint32_t WithAlpha(uint32_t color, float opacity) {
    const float alpha = float(color >> 24) * Unit(opacity) + 0.5f;
    return (color & 0x00FFFFFFu) | uint32_t(alpha) << 24;
}

GxBitmap* LoadTile(const ParamValue& value) {
    const Image tile = value.image.pixels.empty() ? ReadPng(value.path, "pattern tile", kMaxTileSide) : value.image;
    // The pattern layer reads bytes alpha, red, green, blue, straight colour.
    std::vector<unsigned char> bytes(tile.pixels.size() * 4);
    for (size_t i = 0; i < tile.pixels.size(); ++i) {
        const uint32_t c = tile.pixels[i];
        bytes[i * 4 + 0] = uint8_t(c >> 24);
        bytes[i * 4 + 1] = uint8_t(c >> 16);
        bytes[i * 4 + 2] = uint8_t(c >> 8);
        bytes[i * 4 + 3] = uint8_t(c);
    }
    auto* bitmap = new GxBitmap(unsigned(tile.width), unsigned(tile.height), bytes.data(), 4);
    if (bitmap->pixels == nullptr) {
        delete bitmap;
        throw RenderError("pattern tile: out of memory for " + Quote(value.path));
    }
    return bitmap;
}

}  // namespace

const std::vector<EffectSpec>& EffectCatalog() {
    static const std::vector<EffectSpec> catalog = BuildCatalog();
    return catalog;
}

const EffectSpec* FindEffect(std::string_view name) {
    for (const EffectSpec& spec : EffectCatalog()) {
        if (name == spec.name) return &spec;
        for (const char* alias : spec.aliases) {
            if (name == alias) return &spec;
        }
    }
    return nullptr;
}

std::string EffectNames() {
    std::string names;
    for (const EffectSpec& spec : EffectCatalog()) {
        if (!names.empty()) names += ", ";
        names += spec.name;
    }
    return names;
}

const ParamValue& EffectRequest::Get(std::string_view name) const {
    return values[ParamIndex(*spec, name)];
}

EffectRequest ParseEffect(std::string_view text) {
    const size_t colon = text.find(':');
    const EffectSpec& spec = RequireEffect(text.substr(0, colon));
    EffectRequest request = Defaults(spec);
    if (colon != std::string_view::npos) {
        std::string_view rest = text.substr(colon + 1);
        while (!rest.empty()) {
            const size_t comma = rest.find(',');
            const std::string_view item = rest.substr(0, comma);
            rest = comma == std::string_view::npos ? std::string_view() : rest.substr(comma + 1);
            if (item.empty()) continue;
            const size_t equals = item.find('=');
            if (equals == std::string_view::npos) {
                throw UsageError(std::string(spec.name) + ": " + Quote(item) +
                                 " is not name=value (parameters: " + ParamNames(spec) + ")");
            }
            const size_t index = ParamIndex(spec, item.substr(0, equals));
            SetValue(spec, spec.params[index], item.substr(equals + 1), &request.values[index], "");
        }
    }
    CheckComplete(request);
    return request;
}

EffectRequest ParseEffect(const nlohmann::json& object, const std::string& baseDir) {
    if (!object.is_object()) throw UsageError("an effect in the JSON file is not an object");
    const auto type = object.find("type");
    if (type == object.end() || !type->is_string()) {
        throw UsageError("an effect in the JSON file has no \"type\" (one of " + EffectNames() + ")");
    }
    const EffectSpec& spec = RequireEffect(type->get<std::string>());
    EffectRequest request = Defaults(spec);
    for (const auto& [key, value] : object.items()) {
        if (key == "type") continue;
        const size_t index = ParamIndex(spec, key);
        const ParamSpec& param = spec.params[index];
        const std::string what = std::string(spec.name) + " " + param.name;
        std::string text;
        if (value.is_string()) {
            text = value.get<std::string>();
        } else if (value.is_number() && param.type != ParamType::kStops) {
            text = value.dump();
        } else if (value.is_array() && param.type == ParamType::kStops) {
            // Stops as strings ("#FF0000@0.5") or objects {color, position, opacity}.
            for (const auto& stop : value) {
                if (!text.empty()) text += '/';
                if (stop.is_string()) {
                    text += stop.get<std::string>();
                } else if (stop.is_object() && stop.contains("color") && stop["color"].is_string()) {
                    text += stop["color"].get<std::string>();
                    if (stop.contains("position")) text += "@" + stop["position"].dump();
                    if (stop.contains("opacity")) {
                        if (!stop.contains("position")) throw UsageError(what + ": a stop with an opacity needs a position");
                        text += "@" + stop["opacity"].dump();
                    }
                } else {
                    throw UsageError(what + ": a stop must be \"COLOR@POSITION\" or {\"color\": ..., \"position\": ...}");
                }
            }
        } else {
            throw UsageError(what + ": unexpected JSON value " + value.dump());
        }
        SetValue(spec, param, text, &request.values[index], baseDir);
    }
    CheckComplete(request);
    return request;
}

void ApplyEffect(const EffectRequest& effect, GxTextObject* text) {
    GxEffect* stack = text->GetEffect();
    if (stack == nullptr) throw RenderError("the text object has no effect stack");
    const EffectRequest& e = effect;
    auto number = [&](const char* name) { return e.Get(name).number; };
    auto color = [&](const char* name) { return e.Get(name).color; };
    auto choice = [&](const char* name) { return e.Get(name).choice; };

    int id = 0;
    switch (e.spec->kind) {
        case GxECore::kOuterShadow:
            id = stack->addOuterShadowText(number("angle"), number("distance"), number("size"), color("color"),
                                           number("opacity"));
            break;
        case GxECore::kInnerShadow:
            id = stack->addInnerShadowText(number("angle"), number("distance"), number("size"), color("color"),
                                           number("opacity"));
            break;
        case GxECore::kOuterGlow:
        case GxECore::kInnerGlow: {
            const std::vector<GxGradient> stops = ScaledStops(e.Get("stops").stops, number("opacity"));
            const GxGradient* ramp = stops.empty() ? nullptr : stops.data();
            id = e.spec->kind == GxECore::kOuterGlow
                     ? stack->addOuterGlowText(number("size"), color("color"), number("opacity"),
                                               int(stops.size()), ramp)
                     : stack->addInnerGlowText(number("size"), color("color"), number("opacity"),
                                               int(stops.size()), ramp);
            break;
        }
        case GxECore::kStroke:
            // The fourth integer is carried into the key and read by nothing; 0 as the bridge's callers pass.
            id = stack->addStrokeText(number("size"), color("color"), number("opacity"), 0, choice("position"));
            break;
        case GxECore::kLinearGradient: {
            const std::vector<GxGradient> stops = ScaledStops(e.Get("stops").stops, number("opacity"));
            id = stack->addLinearGradientText(number("angle"), number("scale"), number("opacity"),
                                              int(stops.size()), stops.empty() ? nullptr : stops.data());
            break;
        }
        case GxECore::kRadialGradient: {
            const std::vector<GxGradient> stops = ScaledStops(e.Get("stops").stops, number("opacity"));
            id = stack->addRadialGradientText(number("scale"), number("opacity"), int(stops.size()),
                                              stops.empty() ? nullptr : stops.data());
            break;
        }
        case GxECore::kPattern: {
            std::unique_ptr<GxBitmap> tile(LoadTile(e.Get("tile")));
            id = stack->addPatternText(tile.get(), number("scale"), number("opacity"));
            break;
        }
        case GxECore::kBevel:
        case GxECore::kEmboss: {
            const float layer = number("opacity");
            const uint32_t highlight = WithAlpha(color("highlight"), number("highlight-opacity") * Unit(layer));
            const uint32_t shadow = WithAlpha(color("shadow"), number("shadow-opacity") * Unit(layer));
            if (e.spec->kind == GxECore::kBevel) {
                id = stack->addBevelText(choice("style"), number("depth"), number("size"), choice("direction"),
                                         choice("technique"), WholeNumber(number("soften")), layer,
                                         number("angle"), number("altitude"), highlight, number("highlight-opacity"),
                                         shadow, number("shadow-opacity"));
            } else {
                id = stack->addEmbossText(choice("style"), number("depth"), number("size"), choice("direction"),
                                          choice("technique"), WholeNumber(number("soften")), layer,
                                          number("angle"), number("altitude"), highlight, number("highlight-opacity"),
                                          shadow, number("shadow-opacity"));
            }
            break;
        }
        case GxECore::kText:
            text->SetTextColor(color("color"));
            stack->setTextOpacity(number("opacity"));
            return;
        default:
            break;
    }
    if (id < 0) throw RenderError(std::string("the effect stack refused the ") + e.spec->name + " effect");
}

std::string EffectHelp() {
    std::string out;
    for (const EffectSpec& spec : EffectCatalog()) {
        out += "  ";
        out += spec.name;
        if (!spec.aliases.empty()) {
            out += " (also";
            for (const char* alias : spec.aliases) out += std::string(" ") + alias;
            out += ")";
        }
        out += ": ";
        out += spec.summary;
        out += "\n";
        for (const ParamSpec& p : spec.params) {
            std::string line = std::string("      ") + p.name + "=";
            line += p.defaultValue[0] != 0 ? p.defaultValue : "(none)";
            if (line.size() < 32) line.resize(32, ' ');
            else line += "  ";
            line += p.help;
            if (p.type == ParamType::kChoice) line += " [" + ChoiceNames(p) + "]";
            out += line + "\n";
        }
    }
    return out;
}

}  // namespace Glimmer::RenderTool
