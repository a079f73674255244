#pragma once
// The system's font families: turning a font configuration into the font
// manager's families, and the Linux entry point that reads the system's
// configuration and hands it to the font manager.

#include <vector>

#include "platform/SystemFonts.h"

namespace Glimmer {

class FontManager;
class List;

// Appends one GxFontFamily per usable family of `config` to `out`, by the
// rules a device's font configuration is read with: only the first named
// family is kept, and it is loaded at once; italic fonts, unreadable files
// and fonts that are only a fallback for a named family are skipped; a
// family left without fonts is dropped; a family's languages become its
// locale list, and a family without languages (or for symbols or emoji) is
// loaded at once, every other one when a text first needs its locale list.
// Fonts are loaded into `manager`. True when every family was walked.
bool ConvertToFontFamilies(FontManager* manager, const std::vector<Platform::SystemFontFamily>& config,
                           List* out);

// Fills the manager's system families from the system's font configuration
// (fontconfig on Linux). True when they are set, also when they were set
// before (nothing changes then).
bool InstallSystemFontFamilies(FontManager* manager);
bool InstallSystemFontFamilies();
// The same from a configuration read earlier (Platform::GetSystemFontFamilies),
// so that a caller can read it before taking a lock on the manager.
bool InstallSystemFontFamilies(FontManager* manager, const std::vector<Platform::SystemFontFamily>& config);

}  // namespace Glimmer
