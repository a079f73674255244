#pragma once
// Reading the values people type: numbers, colours, colour ramps. Every
// parser names the thing being read (`what`) in its error, so a message says
// which option or parameter was wrong and why.

#include <cstdint>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "glimmer/glimmer.h"

namespace Glimmer::RenderTool {

// The request itself is malformed: an unknown option, effect or parameter,
// a value that does not parse (exit status 2).
class UsageError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};
// A well-formed request that cannot be carried out: a file that cannot be
// read or written, an image too large to allocate (exit status 1).
class RenderError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

// 'text', for messages.
std::string Quote(std::string_view text);

// A finite decimal number ("5", "-2.5", "1e3").
float ParseNumber(std::string_view text, std::string_view what);
// A whole number.
int ParseInteger(std::string_view text, std::string_view what);
bool ParseBoolean(std::string_view text, std::string_view what);

// "#RGB", "#RRGGBB", "#AARRGGBB" (alpha first, as on Android), "0x" in place
// of "#", or a name ("red", "white", "transparent", ...). Colours without an
// alpha are opaque. Returns 0xAARRGGBB.
uint32_t ParseColor(std::string_view text, std::string_view what);
std::string FormatColor(uint32_t color);
// The colour names ParseColor knows, for the help text.
std::string ColorNames();

// A colour ramp: stops "COLOR[@POSITION[@OPACITY]]" separated by '/' or
// spaces. A stop's opacity multiplies its colour's alpha; positions (0..1)
// are given for every stop or for none, and then spread evenly.
std::vector<glimmer::ColorStop> ParseStops(std::string_view text, std::string_view what);

// Reads a whole regular file of at most `maxBytes`; a RenderError naming
// `what` when it cannot (a FIFO or device is refused at once).
std::vector<char> ReadFileBytes(const std::string& path, std::string_view what, size_t maxBytes);

// Limits of the files the renderer reads.
inline constexpr size_t kMaxJsonBytes = size_t(16) << 20;
inline constexpr size_t kMaxPngBytes = size_t(256) << 20;   // a 4096 x 4096 tile, stored without compression

}  // namespace Glimmer::RenderTool
