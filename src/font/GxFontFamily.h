#pragma once
// The records the font manager keeps: the bytes of a font file, and a family
// of the system's font configuration with the entries of its fonts.

#include <cstdint>

namespace Glimmer {

class GxString;
class List;

// The bytes of one font file, shared by every face of it.
struct GxFontData {
    char* data = nullptr;    // new[]; owned
    unsigned int size = 0;
};

// One font of a family, as the font configuration lists it.
struct GxFontEntry {
    GxString* path = nullptr;   // owned
    int ttcIndex = 0;
    int weight = 400;
    bool italic = false;
    GxString* name = nullptr;   // owned; for people, never read by the library
};

// A family of the system's font configuration. Its fonts are loaded into the
// font manager (`built` becomes non-zero) either at once or when a text first
// needs the family's locale list.
struct GxFontFamily {
    int built = 0;
    uint32_t localeListId = 0;
    int variant = 0;
    List* fonts = nullptr;   // of GxFontEntry*; the list and its entries are the family's
};

// Deletes the family with its font list, every entry and their strings.
void DeleteFontFamily(GxFontFamily* family);

}  // namespace Glimmer
