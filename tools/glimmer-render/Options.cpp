#include "Options.h"

#include <climits>
#include <cmath>
#include <functional>

#include <nlohmann/json.hpp>

#include "Values.h"

namespace Glimmer::RenderTool {
namespace {

// Where a value comes from: relative file names in a JSON file are taken
// from the file's folder, and only the command line needs "\n" escapes.
struct Source {
    bool json = false;
    std::string baseDir;
};

std::string Resolve(const std::string& path, const Source& source) {
    if (!source.json || path.empty() || path.front() == '/' || source.baseDir.empty()) return path;
    return source.baseDir + "/" + path;
}

// "\n" breaks the line and "\\" is a backslash; other backslashes stay.
std::string Unescape(const std::string& text) {
    std::string out;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\\' && i + 1 < text.size() && (text[i + 1] == 'n' || text[i + 1] == '\\')) {
            out += text[i + 1] == 'n' ? '\n' : '\\';
            ++i;
        } else {
            out += text[i];
        }
    }
    return out;
}

int Side(const std::string& value, const char* what) {
    const int side = ParseInteger(value, what);
    if (side < 0 || side > glimmer::kMaxSide) throw UsageError(std::string(what) + " must lie in 0..32767");
    return side;
}

int Count(const std::string& value, const char* what) {
    const int n = ParseInteger(value, what);
    if (n < 0) throw UsageError(std::string(what) + " must not be negative");
    return n;
}

template <size_t N>
int Pick(const std::string& value, const char* what, const std::pair<const char*, int> (&choices)[N]) {
    std::string names;
    for (const auto& [name, number] : choices) {
        if (value == name) return number;
        if (!names.empty()) names += ", ";
        names += name;
    }
    throw UsageError(std::string(what) + ": '" + value + "' is not one of " + names);
}

using Apply = std::function<void(Command&, const std::string&, const Source&)>;

struct Option {
    const char* name;          // long name and JSON key
    char shortName;            // 0 for none
    const char* value;         // placeholder; null for a switch
    const char* defaultText;
    const char* help;
    Apply apply;               // a switch receives "true" or "false"
};

std::vector<Option> BuildOptions() {
    return {
        {"text", 't', "TEXT", "Glimmer", "the text (also the first plain argument); \\n breaks the line",
         [](Command& c, const std::string& v, const Source& s) {
             c.request.text = s.json ? v : Unescape(v);
             c.textGiven = true;
         }},
        {"font", 'f', "FILE", "bundled DejaVu Sans Bold", "font file (TrueType or OpenType)",
         [](Command& c, const std::string& v, const Source& s) {
             if (v.empty()) throw UsageError("--font: empty file name");
             c.request.fontPath = Resolve(v, s);
         }},
        {"size", 's', "PX", "72", "text size in pixels per em, 1..2048",
         [](Command& c, const std::string& v, const Source&) {
             c.request.size = ParseNumber(v, "--size");
             if (!(c.request.size >= 1.0f && c.request.size <= glimmer::kMaxTextSize)) {
                 throw UsageError("--size must lie in 1..2048 pixels");
             }
         }},
        {"output", 'o', "FILE", "glimmer.png, gallery.png with --gallery", "the PNG to write",
         [](Command& c, const std::string& v, const Source&) {
             if (v.empty()) throw UsageError("--output: empty file name");
             c.output = v;
         }},
        {"effect", 'e', "KIND[:NAME=VALUE,...]", "none", "add an effect (repeatable; see Effects)",
         [](Command& c, const std::string& v, const Source&) { c.request.effects.push_back(ParseEffect(v)); }},
        {"effects", 'j', "FILE", "none", "read effects and options from a JSON file",
         [](Command& c, const std::string& v, const Source&) { ReadJsonFile(v, &c); }},
        {"width", 0, "PX", "0 (fit the text)", "view width",
         [](Command& c, const std::string& v, const Source&) { c.request.width = Side(v, "--width"); }},
        {"height", 0, "PX", "0 (fit the text)", "view height",
         [](Command& c, const std::string& v, const Source&) { c.request.height = Side(v, "--height"); }},
        {"padding", 0, "PX|L,T,R,B", "0", "view padding, one value or left,top,right,bottom",
         [](Command& c, const std::string& v, const Source&) {
             std::vector<std::string> parts;
             size_t from = 0;
             for (;;) {
                 const size_t comma = v.find(',', from);
                 parts.push_back(v.substr(from, comma == std::string::npos ? std::string::npos : comma - from));
                 if (comma == std::string::npos) break;
                 from = comma + 1;
             }
             if (parts.size() != 1 && parts.size() != 4) {
                 throw UsageError("--padding: give one value or four (left,top,right,bottom)");
             }
             for (int i = 0; i < 4; ++i) c.request.padding[i] = Side(parts[parts.size() == 1 ? 0 : i], "--padding");
         }},
        {"align", 0, "left|center|right", "left", "horizontal gravity and line alignment",
         [](Command& c, const std::string& v, const Source&) {
             static const std::pair<const char*, int> choices[] = {
                 {"left", int(Align::kLeft)}, {"center", int(Align::kCenter)}, {"centre", int(Align::kCenter)},
                 {"right", int(Align::kRight)}};
             c.request.align = Align(Pick(v, "--align", choices));
         }},
        {"gravity", 0, "top|center|bottom", "top", "vertical gravity of the lines in the view",
         [](Command& c, const std::string& v, const Source&) {
             static const std::pair<const char*, int> choices[] = {{"top", int(Gravity::kTop)},
                                                                   {"center", int(Gravity::kCenter)},
                                                                   {"centre", int(Gravity::kCenter)},
                                                                   {"bottom", int(Gravity::kBottom)}};
             c.request.gravity = Gravity(Pick(v, "--gravity", choices));
         }},
        {"wrap", 0, "PX", "the view width if given, else none", "wrap lines at this width; 0 never wraps",
         [](Command& c, const std::string& v, const Source&) { c.request.wrap = float(Side(v, "--wrap")); }},
        {"first-line", 0, "N", "0", "the first line shown, counted from 0",
         [](Command& c, const std::string& v, const Source&) { c.request.firstLine = Count(v, "--first-line"); }},
        {"max-lines", 0, "N", "0 (all)", "show at most this many lines",
         [](Command& c, const std::string& v, const Source&) { c.request.maxLines = Count(v, "--max-lines"); }},
        {"background", 0, "COLOR", "none", "background colour of the line boxes",
         [](Command& c, const std::string& v, const Source&) {
             c.request.background = ParseColor(v, "--background");
             c.request.hasBackground = true;
         }},
        {"italic", 0, nullptr, "off", "italic style (slanted when the font has no italic)",
         [](Command& c, const std::string& v, const Source&) { c.request.italic = ParseBoolean(v, "--italic"); }},
        {"fake-bold", 0, nullptr, "off", "embolden the outlines",
         [](Command& c, const std::string& v, const Source&) { c.request.fakeBold = ParseBoolean(v, "--fake-bold"); }},
        {"scale-x", 0, "F", "1", "horizontal stretch, (0, 10]",
         [](Command& c, const std::string& v, const Source&) { c.request.scaleX = ParseNumber(v, "--scale-x"); }},
        {"skew-x", 0, "F", "0", "slant, -2..2 (negative leans right)",
         [](Command& c, const std::string& v, const Source&) { c.request.skewX = ParseNumber(v, "--skew-x"); }},
        {"letter-spacing", 0, "EM", "0", "extra space between letters in ems",
         [](Command& c, const std::string& v, const Source&) {
             c.request.letterSpacing = ParseNumber(v, "--letter-spacing");
         }},
        {"no-antialias", 0, nullptr, "off", "draw every pixel fully on or off",
         [](Command& c, const std::string& v, const Source&) {
             c.request.antiAlias = !ParseBoolean(v, "--no-antialias");
         }},
        {"subpixel", 0, nullptr, "off", "place glyphs at fractional pixels",
         [](Command& c, const std::string& v, const Source&) { c.request.subpixel = ParseBoolean(v, "--subpixel"); }},
        {"elegant", 0, nullptr, "off", "prefer the elegant variant of font families",
         [](Command& c, const std::string& v, const Source&) { c.request.elegant = ParseBoolean(v, "--elegant"); }},
        {"no-font-padding", 0, nullptr, "off", "lines as tall as ascent and descent only (no font box)",
         [](Command& c, const std::string& v, const Source&) {
             c.request.fontPadding = !ParseBoolean(v, "--no-font-padding");
         }},
        {"features", 0, "CSS", "none", "OpenType features, e.g. \"'liga' 0, 'smcp'\"",
         [](Command& c, const std::string& v, const Source&) { c.request.features = v; }},
        {"locale", 0, "TAGS", "none", "locale list of the paint, e.g. ja or zh-Hant",
         [](Command& c, const std::string& v, const Source&) { c.request.locale = v; }},
        {"exact", 0, nullptr, "off",
         "the engine's literal behaviour: effects stack in the order given, inner effects may paint the line box",
         [](Command& c, const std::string& v, const Source&) { c.request.exact = ParseBoolean(v, "--exact"); }},
        {"gallery", 0, nullptr, "off", "render the contact sheet of every effect instead",
         [](Command& c, const std::string& v, const Source&) {
             if (ParseBoolean(v, "--gallery")) c.mode = Command::Mode::kGallery;
         }},
        {"help", 'h', nullptr, "", "show this help",
         [](Command& c, const std::string&, const Source&) { c.mode = Command::Mode::kHelp; }},
        {"version", 0, nullptr, "", "show the version",
         [](Command& c, const std::string&, const Source&) { c.mode = Command::Mode::kVersion; }},
    };
}

const std::vector<Option>& Options() {
    static const std::vector<Option> options = BuildOptions();
    return options;
}

std::string OptionNames() {
    std::string names;
    for (const Option& o : Options()) {
        if (!names.empty()) names += ", ";
        names += std::string("--") + o.name;
    }
    return names;
}

// The keys a JSON file may use: the options that make sense there.
bool IsJsonKey(const Option& o) {
    const std::string name = o.name;
    return name != "help" && name != "version" && name != "effects";
}

std::string JsonKeyNames() {
    std::string names = "effects";
    for (const Option& o : Options()) {
        if (IsJsonKey(o)) names += std::string(", ") + o.name;
    }
    return names;
}

const Option* FindLong(const std::string& name) {
    for (const Option& o : Options()) {
        if (name == o.name) return &o;
    }
    return nullptr;
}

const Option* FindShort(char name) {
    for (const Option& o : Options()) {
        if (o.shortName != 0 && name == o.shortName) return &o;
    }
    return nullptr;
}

std::string DirectoryOf(const std::string& path) {
    const size_t slash = path.rfind('/');
    if (slash == std::string::npos) return "";
    return slash == 0 ? "/" : path.substr(0, slash);
}

}  // namespace

Command ParseCommandLine(const std::vector<std::string>& args) {
    Command command;
    const Source commandLine;
    for (size_t i = 0; i < args.size(); ++i) {
        const std::string& arg = args[i];
        const Option* option = nullptr;
        std::string value;
        bool hasValue = false;
        if (arg.rfind("--", 0) == 0 && arg.size() > 2) {
            const size_t equals = arg.find('=');
            const std::string name = arg.substr(2, equals == std::string::npos ? std::string::npos : equals - 2);
            option = FindLong(name);
            if (option == nullptr) {
                throw UsageError("unknown option --" + name + " (valid: " + OptionNames() + ")");
            }
            if (equals != std::string::npos) {
                value = arg.substr(equals + 1);
                hasValue = true;
            }
        } else if (arg.size() == 2 && arg[0] == '-' && arg[1] != '-') {
            option = FindShort(arg[1]);
            if (option == nullptr) throw UsageError("unknown option " + arg + " (see --help)");
        } else {
            // A plain argument is the text.
            if (command.textGiven) throw UsageError("unexpected argument '" + arg + "': the text is already given");
            command.request.text = Unescape(arg);
            command.textGiven = true;
            continue;
        }

        if (option->value == nullptr) {
            if (hasValue) throw UsageError(std::string("--") + option->name + " takes no value");
            option->apply(command, "true", commandLine);
            continue;
        }
        if (!hasValue) {
            if (i + 1 >= args.size()) {
                throw UsageError(std::string("--") + option->name + " needs a value (" + option->value + ")");
            }
            value = args[++i];
        }
        option->apply(command, value, commandLine);
    }
    return command;
}

void ReadJsonFile(const std::string& path, Command* command) {
    const std::vector<char> bytes = ReadFileBytes(path, "--effects", kMaxJsonBytes);
    ReadJsonText(std::string_view(bytes.data(), bytes.size()), path, command);
}

void ReadJsonText(std::string_view bytes, const std::string& path, Command* command) {
    nlohmann::json document;
    try {
        document = nlohmann::json::parse(bytes.begin(), bytes.end());
    } catch (const nlohmann::json::exception& e) {
        std::string reason = e.what();
        // "[json.exception.parse_error.101] parse error at line 3, column 5: ..." -> after the tag
        const size_t tag = reason.find("] ");
        if (tag != std::string::npos) reason = reason.substr(tag + 2);
        throw UsageError("--effects: '" + path + "' is not valid JSON: " + reason);
    }
    Source source;
    source.json = true;
    source.baseDir = DirectoryOf(path);

    auto addEffects = [&](const nlohmann::json& list) {
        if (!list.is_array()) throw UsageError("--effects: \"effects\" must be an array in '" + path + "'");
        for (const nlohmann::json& effect : list) {
            command->request.effects.push_back(ParseEffect(effect, source.baseDir));
        }
    };
    try {
        if (document.is_array()) {
            addEffects(document);
            return;
        }
        if (!document.is_object()) {
            throw UsageError("--effects: '" + path + "' must hold an array of effects or an object");
        }
        for (const auto& [key, value] : document.items()) {
            if (key == "effects") {
                addEffects(value);
                continue;
            }
            const Option* option = FindLong(key);
            if (option == nullptr || !IsJsonKey(*option)) {
                throw UsageError("--effects: unknown key \"" + key + "\" in '" + path + "' (valid: " +
                                 JsonKeyNames() + ")");
            }
            std::string text;
            if (value.is_string()) {
                text = value.get<std::string>();
            } else if (value.is_number()) {
                text = value.dump();
            } else if (value.is_boolean() && option->value == nullptr) {
                text = value.get<bool>() ? "true" : "false";
            } else if (value.is_array() && key == "padding") {
                for (const nlohmann::json& side : value) {
                    if (!text.empty()) text += ',';
                    text += side.dump();
                }
            } else {
                throw UsageError("--effects: \"" + key + "\" has an unexpected value " + value.dump());
            }
            if (option->value == nullptr && !value.is_boolean()) {
                throw UsageError("--effects: \"" + key + "\" must be true or false");
            }
            option->apply(*command, text, source);
        }
    } catch (const UsageError& e) {
        const std::string message = e.what();
        if (message.rfind("--effects", 0) == 0) throw;
        throw UsageError("--effects '" + path + "': " + message);
    }
}

std::string HelpText() {
    std::string out =
        "Usage: glimmer-render [OPTIONS] [TEXT]\n"
        "\n"
        "Renders a text with effects through the Glimmer library, exactly as an application gets it\n"
        "on a device, and writes the picture as a PNG. Prints the bitmap size, the four margins by\n"
        "which the effects reach past the view, and the effect key.\n"
        "\n"
        "Options:\n";
    for (const Option& o : Options()) {
        std::string line = "  ";
        line += o.shortName != 0 ? std::string("-") + o.shortName + ", " : "    ";
        line += std::string("--") + o.name;
        if (o.value != nullptr) line += std::string(" ") + o.value;
        if (line.size() < 36) line.resize(36, ' ');
        else line += "\n" + std::string(36, ' ');
        line += o.help;
        if (o.defaultText[0] != 0 && o.value != nullptr) line += std::string(" [") + o.defaultText + "]";
        out += line + "\n";
    }
    out +=
        "\n"
        "Effects (-e KIND:NAME=VALUE,...; parameters with their defaults):\n" +
        EffectHelp() +
        "\n"
        "Values:\n"
        "  colours   #RRGGBB, #AARRGGBB (alpha first), #RGB, 0xAARRGGBB or a name: " + ColorNames() + "\n"
        "  stops     COLOR[@POSITION[@OPACITY]] separated by '/', e.g. #FFE600@0/#FF3C00@0.5/#8000FF@1;\n"
        "            positions 0..1 for all stops or none (then evenly spread); an opacity multiplies the colour's alpha\n"
        "  An effect kind given twice is drawn once, with the last parameters.\n"
        "\n"
        "Stacking: effects stack in one order whatever the order given, bottom to top: outer shadow, outer\n"
        "glow, stroke (outside or center), outer bevel, emboss outside the glyphs; the fill, pattern, radial\n"
        "and linear gradient, inner glow, inner shadow, stroke (inside), bevel, emboss inside them. Inner\n"
        "effects stay inside the glyphs. --exact stacks by the order given, as the engine itself does.\n"
        "\n"
        "JSON (--effects FILE): an array of effects, or an object with \"effects\" and any option by its\n"
        "long name; relative file names are taken from the JSON file's folder:\n"
        "  {\"text\": \"Hello\", \"size\": 96, \"effects\": [\n"
        "     {\"type\": \"stroke\", \"size\": 4, \"color\": \"#D7263D\", \"position\": \"outside\"},\n"
        "     {\"type\": \"outer-glow\", \"size\": 12, \"stops\": [\"#FFE600@0\", {\"color\": \"#8000FF\", \"position\": 1}]}]}\n"
        "\n"
        "Exit status: 0 on success; 2 for a malformed request (unknown option, effect or parameter, a\n"
        "value that does not parse); 1 when a request cannot be carried out (a file that cannot be read\n"
        "or written, an image too large to allocate). Errors are one line on standard error; no PNG is\n"
        "written unless the render succeeded.\n"
        "Set GLIMMER_LOG_LEVEL=debug to see the library's log lines.\n";
    return out;
}

}  // namespace Glimmer::RenderTool
