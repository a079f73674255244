// The effect catalogue and the library effect each entry becomes.
//
// Every value goes to the library as typed, unclamped, so the library applies
// its clamps (the help text states them). Parameter names, defaults and
// ranges are the library's own; a test keeps the defaults in step.

#include "Effects.h"

#include <algorithm>
#include <cmath>
#include <memory>

#include <nlohmann/json.hpp>

#include "Png.h"
#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

constexpr const char* kAngleHelp = "degrees, any value (folded into 0..359)";
constexpr const char* kOpacityHelp = "0..1 (clamped)";
constexpr const char* kPercentHelp = "pixels, 0..100 (truncated and clamped)";

std::vector<ParamSpec> ShadowParams() {
    return {
        {"angle", ParamType::kNumber, "120", kAngleHelp},
        {"distance", ParamType::kNumber, "5", kPercentHelp},
        {"size", ParamType::kNumber, "5", "blur radius in pixels, 0..100 (truncated and clamped)"},
        {"color", ParamType::kColor, "#000000", "its alpha multiplies the opacity"},
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
                          {{"plain", 0}, {"two-sided", 1}}});
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
        {"outer-shadow", {"shadow", "drop-shadow"}, EffectKind::kOuterShadow,
         "a blurred copy of the text behind it; angle 0 casts it to the left, 90 down",
         ShadowParams()},
        {"inner-shadow", {}, EffectKind::kInnerShadow,
         "shades the inside of the glyphs along their edges; angle 0 the right ones, 90 the top ones", ShadowParams()},
        {"outer-glow", {"glow"}, EffectKind::kOuterGlow, "a soft halo around the glyphs", glow},
        {"inner-glow", {}, EffectKind::kInnerGlow, "lights the glyphs from their edges inward", glow},
        {"stroke", {"outline"}, EffectKind::kStroke, "an outline along the glyph edges",
         {
             {"size", ParamType::kNumber, "3", "width in pixels, 0..100 (truncated and clamped)"},
             {"color", ParamType::kColor, "#000000", "its alpha multiplies the opacity"},
             {"opacity", ParamType::kNumber, "1", kOpacityHelp},
             {"position", ParamType::kChoice, "outside", "where the band lies against the edge",
              {{"outside", 1}, {"center", 0}, {"centre", 0}, {"inside", 2}}},
         }},
        {"linear-gradient", {"gradient"}, EffectKind::kLinearGradient, "fills the glyphs with a colour ramp",
         {
             {"angle", ParamType::kNumber, "90", "degrees (folded into 0..359); 0 runs from the first stop on the left, 90 from the bottom"},
             {"scale", ParamType::kNumber, "1", "length of the ramp against the text box, 0..2 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", "0..1; scales every stop"},
             {"stops", ParamType::kStops, "#FFFFFF/#000000", "the colour ramp"},
         }},
        {"radial-gradient", {"radial"}, EffectKind::kRadialGradient,
         "fills the glyphs with a ramp from the centre of the text box",
         {
             {"scale", ParamType::kNumber, "1", "radius against half the box width, 0..2 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", "0..1; scales every stop"},
             {"stops", ParamType::kStops, "#FFFFFF/#000000", "the colour ramp, centre first"},
         }},
        {"pattern", {}, EffectKind::kPattern, "fills the glyphs with a repeated PNG tile",
         {
             {"tile", ParamType::kFile, "", "PNG file (required)"},
             {"scale", ParamType::kNumber, "1", "tile magnification, 0..10 (clamped); below 0.1 draws nothing"},
             {"opacity", ParamType::kNumber, "1", kOpacityHelp},
         }},
        {"bevel", {}, EffectKind::kBevel, "makes the glyphs look raised", ReliefParams(false)},
        {"emboss", {}, EffectKind::kEmboss, "makes the glyphs look pressed up out of the surface",
         ReliefParams(true)},
        {"text", {"fill"}, EffectKind::kText, "the glyphs themselves",
         {
             {"color", ParamType::kColor, "#000000",
              "the fill colour; its alpha fades the whole picture, effects included"},
             {"opacity", ParamType::kNumber, "1",
              "fill opacity 0..1 (clamped): fades the fill, not the effects (--exact: the engine's text opacity)"},
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

glimmer::Image LoadTile(const ParamValue& value) {
    const Image tile =
        value.image.pixels.empty() ? ReadPng(value.path, "pattern tile", glimmer::kMaxTileSide) : value.image;
    return glimmer::Image{tile.width, tile.height, tile.pixels};
}

template <typename Relief>
Relief MakeRelief(const EffectRequest& e) {
    Relief r;
    r.size = e.Get("size").number;
    r.depth = e.Get("depth").number;
    r.direction = e.Get("direction").choice == 1 ? glimmer::ReliefDirection::kUp : glimmer::ReliefDirection::kDown;
    r.technique = e.Get("technique").choice == 1 ? glimmer::ReliefTechnique::kHard : glimmer::ReliefTechnique::kSmooth;
    r.soften = int(std::clamp(e.Get("soften").number, -1.0e6f, 1.0e6f));
    r.angle = e.Get("angle").number;
    r.altitude = e.Get("altitude").number;
    r.highlight = e.Get("highlight").color;
    r.highlightOpacity = e.Get("highlight-opacity").number;
    r.shadow = e.Get("shadow").color;
    r.shadowOpacity = e.Get("shadow-opacity").number;
    r.opacity = e.Get("opacity").number;
    return r;
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

void AddEffect(const EffectRequest& e, glimmer::Text* text) {
    auto number = [&](const char* name) { return e.Get(name).number; };
    auto color = [&](const char* name) { return e.Get(name).color; };
    auto choice = [&](const char* name) { return e.Get(name).choice; };
    switch (e.spec->kind) {
        case EffectKind::kOuterShadow:
            text->effects.push_back(glimmer::OuterShadow{number("angle"), number("distance"), number("size"),
                                                         color("color"), number("opacity")});
            return;
        case EffectKind::kInnerShadow:
            text->effects.push_back(glimmer::InnerShadow{number("angle"), number("distance"), number("size"),
                                                         color("color"), number("opacity")});
            return;
        case EffectKind::kOuterGlow:
            text->effects.push_back(
                glimmer::OuterGlow{number("size"), color("color"), number("opacity"), e.Get("stops").stops});
            return;
        case EffectKind::kInnerGlow:
            text->effects.push_back(
                glimmer::InnerGlow{number("size"), color("color"), number("opacity"), e.Get("stops").stops});
            return;
        case EffectKind::kStroke: {
            const int position = choice("position");
            text->effects.push_back(glimmer::Stroke{number("size"), color("color"), number("opacity"),
                                                    position == 0   ? glimmer::StrokePosition::kCenter
                                                    : position == 2 ? glimmer::StrokePosition::kInside
                                                                    : glimmer::StrokePosition::kOutside});
            return;
        }
        case EffectKind::kLinearGradient:
            text->effects.push_back(
                glimmer::LinearGradient{number("angle"), number("scale"), number("opacity"), e.Get("stops").stops});
            return;
        case EffectKind::kRadialGradient:
            text->effects.push_back(glimmer::RadialGradient{number("scale"), number("opacity"), e.Get("stops").stops});
            return;
        case EffectKind::kPattern:
            text->effects.push_back(glimmer::Pattern{LoadTile(e.Get("tile")), number("scale"), number("opacity")});
            return;
        case EffectKind::kBevel: {
            glimmer::Bevel bevel = MakeRelief<glimmer::Bevel>(e);
            bevel.style = choice("style") == 0 ? glimmer::BevelStyle::kOuter : glimmer::BevelStyle::kInner;
            text->effects.push_back(bevel);
            return;
        }
        case EffectKind::kEmboss: {
            glimmer::Emboss emboss = MakeRelief<glimmer::Emboss>(e);
            emboss.style = choice("style") == 1 ? glimmer::EmbossStyle::kTwoSided : glimmer::EmbossStyle::kPlain;
            text->effects.push_back(emboss);
            return;
        }
        case EffectKind::kText:
            text->style.color = color("color");
            text->style.fillOpacity = number("opacity");
            return;
    }
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
