#pragma once
// The command line and the JSON file: both fill one Command through the same
// option table (a JSON key is an option's long name), so every option can be
// given either way and --help lists them all with their defaults.

#include <string>
#include <string_view>
#include <vector>

#include "Renderer.h"

namespace Glimmer::RenderTool {

struct Command {
    enum class Mode { kRender, kGallery, kHelp, kVersion };
    Mode mode = Mode::kRender;
    RenderRequest request;
    std::string output;    // empty: glimmer.png, or gallery.png for the gallery
    bool textGiven = false;
};

// Arguments without the program name. UsageError on anything malformed;
// RenderError when a named file (JSON) cannot be read.
Command ParseCommandLine(const std::vector<std::string>& args);

// Reads a JSON file of options and effects into `command`: either an array
// of effects or an object whose "effects" member is that array and whose
// other members are options by their long names.
void ReadJsonFile(const std::string& path, Command* command);
// The same from the file's bytes; `path` names it in messages and anchors
// relative paths in it.
void ReadJsonText(std::string_view bytes, const std::string& path, Command* command);

std::string HelpText();

}  // namespace Glimmer::RenderTool
