#include "Values.h"

#include "api/FileBytes.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <utility>

namespace Glimmer::RenderTool {
namespace {

std::string_view Trim(std::string_view text) {
    while (!text.empty() && (text.front() == ' ' || text.front() == '\t')) text.remove_prefix(1);
    while (!text.empty() && (text.back() == ' ' || text.back() == '\t')) text.remove_suffix(1);
    return text;
}

std::string Lower(std::string_view text) {
    std::string out(text);
    for (char& c : out) {
        if (c >= 'A' && c <= 'Z') c = char(c - 'A' + 'a');
    }
    return out;
}

const std::pair<const char*, uint32_t> kNamedColors[] = {
    {"black", 0xFF000000u},  {"white", 0xFFFFFFFFu},   {"red", 0xFFFF0000u},
    {"green", 0xFF00FF00u},  {"blue", 0xFF0000FFu},    {"yellow", 0xFFFFFF00u},
    {"cyan", 0xFF00FFFFu},   {"magenta", 0xFFFF00FFu}, {"gray", 0xFF808080u},
    {"grey", 0xFF808080u},   {"orange", 0xFFFFA500u},  {"purple", 0xFF800080u},
    {"gold", 0xFFFFD700u},   {"transparent", 0x00000000u},
};

int HexDigit(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    if (c >= 'a' && c <= 'f') return c - 'a' + 10;
    if (c >= 'A' && c <= 'F') return c - 'A' + 10;
    return -1;
}

// One stop of a ramp; `hasPosition` tells whether a position was given.
glimmer::ColorStop ParseStop(std::string_view text, std::string_view what, bool* hasPosition) {
    const std::string_view t = Trim(text);
    std::vector<std::string_view> parts;
    size_t from = 0;
    for (;;) {
        const size_t at = t.find('@', from);
        parts.push_back(t.substr(from, at == std::string_view::npos ? std::string_view::npos : at - from));
        if (at == std::string_view::npos) break;
        from = at + 1;
    }
    if (parts.size() > 3) {
        throw UsageError(std::string(what) + ": stop " + Quote(t) + " has more than COLOR@POSITION@OPACITY");
    }
    const std::string label = std::string(what) + " stop " + Quote(t);
    glimmer::ColorStop stop;
    stop.color = ParseColor(parts[0], label);
    stop.position = -1.0f;
    *hasPosition = parts.size() >= 2;
    if (parts.size() >= 2) {
        stop.position = ParseNumber(parts[1], label + " position");
        if (stop.position < 0.0f || stop.position > 1.0f) {
            throw UsageError(label + ": the position must lie in 0..1");
        }
    }
    if (parts.size() == 3) stop.opacity = ParseNumber(parts[2], label + " opacity");
    return stop;
}

}  // namespace

std::string Quote(std::string_view text) {
    std::string quoted(1, '\'');
    quoted += text;
    quoted += '\'';
    return quoted;
}

float ParseNumber(std::string_view text, std::string_view what) {
    std::string_view t = Trim(text);
    if (!t.empty() && t.front() == '+') t.remove_prefix(1);
    float value = 0.0f;
    auto [end, error] = std::from_chars(t.data(), t.data() + t.size(), value);
    if (t.empty() || error != std::errc() || end != t.data() + t.size() || !std::isfinite(value)) {
        throw UsageError(std::string(what) + ": " + Quote(text) + " is not a number");
    }
    return value;
}

int ParseInteger(std::string_view text, std::string_view what) {
    std::string_view t = Trim(text);
    if (!t.empty() && t.front() == '+') t.remove_prefix(1);
    int value = 0;
    auto [end, error] = std::from_chars(t.data(), t.data() + t.size(), value);
    if (t.empty() || error != std::errc() || end != t.data() + t.size()) {
        throw UsageError(std::string(what) + ": " + Quote(text) + " is not a whole number");
    }
    return value;
}

bool ParseBoolean(std::string_view text, std::string_view what) {
    const std::string t = Lower(Trim(text));
    if (t == "true" || t == "on" || t == "yes" || t == "1") return true;
    if (t == "false" || t == "off" || t == "no" || t == "0") return false;
    throw UsageError(std::string(what) + ": " + Quote(text) + " is neither true nor false");
}

uint32_t ParseColor(std::string_view text, std::string_view what) {
    const std::string_view t = Trim(text);
    const std::string lower = Lower(t);
    for (const auto& [name, value] : kNamedColors) {
        if (lower == name) return value;
    }
    std::string_view digits;
    if (!t.empty() && t.front() == '#') {
        digits = t.substr(1);
    } else if (lower.rfind("0x", 0) == 0) {
        digits = t.substr(2);
    }
    uint32_t value = 0;
    bool ok = digits.size() == 3 || digits.size() == 6 || digits.size() == 8;
    for (char c : digits) {
        const int d = HexDigit(c);
        if (d < 0) ok = false;
        value = value << 4 | uint32_t(d < 0 ? 0 : d);
    }
    if (!ok) {
        throw UsageError(std::string(what) + ": " + Quote(text) +
                         " is not a colour (use #RRGGBB, #AARRGGBB, #RGB or a name such as red)");
    }
    if (digits.size() == 3) {
        const uint32_t r = value >> 8 & 15, g = value >> 4 & 15, b = value & 15;
        return 0xFF000000u | (r * 17) << 16 | (g * 17) << 8 | b * 17;
    }
    return digits.size() == 6 ? 0xFF000000u | value : value;
}

std::string FormatColor(uint32_t color) {
    char text[16];
    if (color >> 24 == 0xFF) {
        std::snprintf(text, sizeof text, "#%06X", unsigned(color & 0xFFFFFFu));
    } else {
        std::snprintf(text, sizeof text, "#%08X", unsigned(color));
    }
    return text;
}

std::string ColorNames() {
    std::string names;
    for (const auto& [name, value] : kNamedColors) {
        if (!names.empty()) names += ", ";
        names += name;
    }
    return names;
}


std::vector<glimmer::ColorStop> ParseStops(std::string_view text, std::string_view what) {
    std::vector<glimmer::ColorStop> stops;
    std::vector<bool> positioned;
    size_t from = 0;
    while (from <= text.size()) {
        size_t at = text.find_first_of("/ ", from);
        if (at == std::string_view::npos) at = text.size();
        const std::string_view piece = text.substr(from, at - from);
        if (!Trim(piece).empty()) {
            bool hasPosition = false;
            stops.push_back(ParseStop(piece, what, &hasPosition));
            positioned.push_back(hasPosition);
        }
        from = at + 1;
    }
    if (stops.empty()) return stops;
    const bool all = std::all_of(positioned.begin(), positioned.end(), [](bool b) { return b; });
    const bool none = std::none_of(positioned.begin(), positioned.end(), [](bool b) { return b; });
    if (!all && !none) {
        throw UsageError(std::string(what) + ": give a position to every stop or to none");
    }
    if (none) {
        const size_t n = stops.size();
        for (size_t i = 0; i < n; ++i) stops[i].position = n == 1 ? 0.0f : float(i) / float(n - 1);
    }
    for (size_t i = 1; i < stops.size(); ++i) {
        if (stops[i].position < stops[i - 1].position) {
            throw UsageError(std::string(what) + ": stop positions must not decrease");
        }
    }
    return stops;
}

std::vector<char> ReadFileBytes(const std::string& path, std::string_view what, size_t maxBytes) {
    // The library's own reader: regular files only, opened without blocking
    // and read up to the limit, so a FIFO or a device cannot hang or flood us.
    glimmer::detail::FileBytes file = glimmer::detail::ReadFileBytes(path, maxBytes);
    if (!file.error.empty()) throw RenderError(std::string(what) + ": " + file.error);
    if (file.bytes.empty()) throw RenderError(std::string(what) + ": " + Quote(path) + " is empty");
    return std::move(file.bytes);
}

}  // namespace Glimmer::RenderTool
