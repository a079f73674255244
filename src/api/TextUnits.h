#pragma once
// A public text's UTF-8 as the core takes it: UTF-16 units for layout, code
// points for the text object, and the UTF-8 offset of every unit so that line
// ranges can be reported in the caller's terms.

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace glimmer::detail {

struct TextUnits {
    std::u16string utf16;
    std::wstring codePoints;           // one per wchar_t
    std::vector<size_t> utf8Offsets;   // per UTF-16 unit, plus one for the end
};

// Decodes well-formed UTF-8 (no overlong forms, surrogates or values past
// U+10FFFF). A carriage return before a line feed is dropped: "\r\n" is one
// line break. U+0000 is refused, since the core's text ends at it. Returns an
// error message, or "" on success.
std::string DecodeText(std::string_view utf8, TextUnits* out);

}  // namespace glimmer::detail
