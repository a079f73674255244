#include "api/TextUnits.h"

#include <cstdint>

namespace glimmer::detail {

std::string DecodeText(std::string_view utf8, TextUnits* out) {
    out->utf16.clear();
    out->codePoints.clear();
    out->utf8Offsets.clear();
    const auto* bytes = reinterpret_cast<const unsigned char*>(utf8.data());
    const size_t size = utf8.size();
    for (size_t i = 0; i < size;) {
        const size_t at = i;
        const unsigned char lead = bytes[i];
        uint32_t cp = 0;
        size_t length = 0;
        uint32_t least = 0;
        if (lead < 0x80) {
            cp = lead, length = 1;
        } else if (lead >= 0xC2 && lead < 0xE0) {
            cp = lead & 0x1F, length = 2, least = 0x80;
        } else if (lead >= 0xE0 && lead < 0xF0) {
            cp = lead & 0x0F, length = 3, least = 0x800;
        } else if (lead >= 0xF0 && lead < 0xF5) {
            cp = lead & 0x07, length = 4, least = 0x10000;
        }
        bool ok = length > 0 && size - i >= length;
        for (size_t k = 1; ok && k < length; ++k) {
            ok = (bytes[i + k] & 0xC0) == 0x80;
            cp = cp << 6 | (bytes[i + k] & 0x3F);
        }
        if (!ok || cp < least || cp > 0x10FFFF || (cp >= 0xD800 && cp < 0xE000)) {
            return "the text is not valid UTF-8 (at byte " + std::to_string(at) + ")";
        }
        if (cp == 0) return "the text contains U+0000 (at byte " + std::to_string(at) + ")";
        i += length;
        if (cp == '\r' && i < size && bytes[i] == '\n') continue;
        out->codePoints.push_back(wchar_t(cp));
        if (cp >= 0x10000) {
            out->utf16.push_back(char16_t(0xD800 + ((cp - 0x10000) >> 10)));
            out->utf16.push_back(char16_t(0xDC00 + (cp & 0x3FF)));
            out->utf8Offsets.push_back(at);
            out->utf8Offsets.push_back(at);
        } else {
            out->utf16.push_back(char16_t(cp));
            out->utf8Offsets.push_back(at);
        }
    }
    out->utf8Offsets.push_back(size);
    return "";
}

}  // namespace glimmer::detail
