#pragma once
// The effects the renderer offers: one entry per layer kind of the effect
// stack, with the parameter names people expect, their defaults and ranges.
// The catalogue drives everything: parsing "KIND:name=value,..." from the
// command line and {"type": KIND, name: value} from JSON, the help text, and
// the library effect each entry becomes.

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include <nlohmann/json_fwd.hpp>

#include "Png.h"
#include "glimmer/glimmer.h"

namespace Glimmer::RenderTool {

// One per effect type of the library, and the text fill.
enum class EffectKind {
    kOuterShadow,
    kInnerShadow,
    kOuterGlow,
    kInnerGlow,
    kStroke,
    kLinearGradient,
    kRadialGradient,
    kPattern,
    kBevel,
    kEmboss,
    kText,
};

enum class ParamType { kNumber, kColor, kChoice, kStops, kFile };

struct Choice {
    const char* name;
    int value;
};

struct ParamSpec {
    const char* name;
    ParamType type;
    const char* defaultValue;   // read like typed input; "" for none
    const char* help;
    std::vector<Choice> choices = {};
};

struct EffectSpec {
    const char* name;
    std::vector<const char*> aliases;
    EffectKind kind;
    const char* summary;
    std::vector<ParamSpec> params;
};

const std::vector<EffectSpec>& EffectCatalog();
// By name or alias; null when unknown.
const EffectSpec* FindEffect(std::string_view name);
// "outer-shadow, inner-shadow, ..." for error messages.
std::string EffectNames();

struct ParamValue {
    float number = 0.0f;
    uint32_t color = 0;
    int choice = 0;
    std::vector<glimmer::ColorStop> stops;
    std::string path;
    Image image;   // a file's content given directly (non-empty: used instead of path)
};

struct EffectRequest {
    const EffectSpec* spec = nullptr;
    std::vector<ParamValue> values;   // one per parameter of spec, in order

    const ParamValue& Get(std::string_view name) const;
};

// "stroke" or "stroke:size=4,color=#FF0000,position=outside".
EffectRequest ParseEffect(std::string_view text);
// {"type": "stroke", "size": 4, ...}; relative file names are taken from
// `baseDir`.
EffectRequest ParseEffect(const nlohmann::json& object, const std::string& baseDir);

// Adds the effect to the text; the text kind sets the fill colour and
// opacity instead. RenderError when a tile file cannot be read.
void AddEffect(const EffectRequest& effect, glimmer::Text* text);

// The effects section of --help.
std::string EffectHelp();

}  // namespace Glimmer::RenderTool
