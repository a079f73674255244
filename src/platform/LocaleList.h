#pragma once
// The process-wide registry of locale lists. A list is a comma-separated
// string of BCP 47 tags ("ja", "zh-Hans", "und-Arab,en-US"); registering it
// gives a small id that fonts and paints carry instead of the string. The
// same list always gets the same id; ids are never reused. Safe from any
// thread.

#include <cstdint>
#include <string>
#include <vector>

namespace Glimmer::Platform {

// The id of the empty list, and of a string in which no tag is well formed.
constexpr uint32_t kEmptyLocaleListId = 0;

// Tags are normalised before they are compared: '_' reads as '-', language in
// lower case, script in title case, region in upper case; variants and
// extensions are dropped, as are tags that are not well formed and repeats.
uint32_t RegisterLocaleList(const char* locales);

// The normalised tags of a registered list, in order; empty for id 0 and for
// ids never handed out.
std::vector<std::string> GetLocaleList(uint32_t id);

}  // namespace Glimmer::Platform
