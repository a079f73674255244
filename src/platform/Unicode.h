#pragma once
// Unicode properties the text code asks the platform for.

#include <cstdint>

namespace Glimmer::Platform {

// ISO 15924 script tags, four letters packed most significant byte first.
constexpr uint32_t ScriptTag(char a, char b, char c, char d) {
    return uint32_t(uint8_t(a)) << 24 | uint32_t(uint8_t(b)) << 16 | uint32_t(uint8_t(c)) << 8 |
           uint32_t(uint8_t(d));
}

constexpr uint32_t kScriptInvalid = 0;
constexpr uint32_t kScriptCommon = ScriptTag('Z', 'y', 'y', 'y');
constexpr uint32_t kScriptInherited = ScriptTag('Z', 'i', 'n', 'h');
constexpr uint32_t kScriptUnknown = ScriptTag('Z', 'z', 'z', 'z');
constexpr uint32_t kScriptLatin = ScriptTag('L', 'a', 't', 'n');
constexpr uint32_t kScriptHangul = ScriptTag('H', 'a', 'n', 'g');
constexpr uint32_t kScriptHiragana = ScriptTag('H', 'i', 'r', 'a');
constexpr uint32_t kScriptKatakana = ScriptTag('K', 'a', 'n', 'a');
constexpr uint32_t kScriptHan = ScriptTag('H', 'a', 'n', 'i');

// The script of a code point (kScriptUnknown for unassigned ones).
uint32_t ScriptOf(uint32_t codePoint);

}  // namespace Glimmer::Platform
