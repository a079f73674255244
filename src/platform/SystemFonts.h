#pragma once
// The system's font configuration: which font files make up which families,
// for which languages. On a device Java hands it over; on Linux it comes from
// the system font configuration. The records are plain descriptions; turning
// them into loaded families is the font manager's job.

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "platform/Font.h"

namespace Glimmer::Platform {

struct SystemFont {
    std::string path;
    int ttcIndex = 0;
    int weight = 400;
    bool italic = false;
    std::string name;          // the face's own name, for people
    std::string fallbackFor;   // non-empty: only a fallback for that named family
};

struct SystemFontFamily {
    std::string name;          // empty for a fallback family
    std::string languages;     // locale list the family serves; empty for all
    int variant = 0;
    std::vector<SystemFont> fonts;
};

// The default family first (named "sans-serif"), then one fallback family per
// script or language the system has a font for.
std::vector<SystemFontFamily> GetSystemFontFamilies();

// The last resort for a character no family of a typeface has: the first
// font, in the system's order of preference for sans-serif text, that maps
// `codePoint` (with `color`, only colour fonts are taken). Null when none
// does. Fonts found here are loaded once and kept for the life of the
// process; callers on any thread.
std::shared_ptr<Font> SystemFallbackFont(uint32_t codePoint, bool color);

}  // namespace Glimmer::Platform
