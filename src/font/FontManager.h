#pragma once
// FontManager: the process-wide store of fonts.
//
// It loads font files (or takes font bytes handed in), makes fonts of them
// keyed by path and collection index, holds the system's font families, and
// assembles for each text the ordered families that layout uses: the text's
// own font first, then the system families as fallbacks. Font bytes are read
// once per path and shared by every face of the file; fonts and bytes are
// kept until the manager goes.
//
// Not locked: callers use it from one thread at a time. Failures are false
// results with a log line under "GxFontManager"; only missing state reports
// error code 8.

#include <memory>
#include <vector>

#include "font/GxFontFamily.h"
#include "platform/Font.h"

namespace Glimmer {

class GxString;
class List;
struct GxFontManagerImpl;

class FontManager {
public:
    // The library's instance, made on first use; it lives until process exit.
    static FontManager* GetInstance();

    // A manager of its own, empty (tools and tests; the library uses
    // GetInstance).
    FontManager();
    ~FontManager();
    FontManager(const FontManager&) = delete;
    FontManager& operator=(const FontManager&) = delete;

    bool IsExisting(const char* path, int ttcIndex);

    // Makes face `ttcIndex` of a font known under `path`. With `data` null
    // the file at `path` is read (once; later calls share its bytes).
    // Otherwise the call takes the new[] array `data` of `size` bytes, on
    // success and on failure alike. With checkExisting, a face already known
    // is kept and the call succeeds.
    bool AddMinikinFont(const char* path, char* data, unsigned int size, int ttcIndex,
                        bool checkExisting);
    bool AddMinikinFont(const GxString* path, char* data, unsigned int size, int ttcIndex,
                        bool checkExisting);

    // Forgets face `ttcIndex` of the font made from bytes handed in under
    // `path`; whoever still holds the face keeps it until they let go. Only
    // the font-bytes fuzzer calls it: its throwaway fonts would otherwise stay
    // for the life of the process.
    void ForgetMinikinFont(const char* path, int ttcIndex);

    // Loads every font of the family; false at the first that fails.
    bool BuildMinikinFamily(GxFontFamily* family);
    // Builds the first unbuilt system family of that locale list.
    bool LoadMinikinFontFamily(unsigned int localeListId);

    // Takes the list (of GxFontFamily*) the first time; later lists are
    // ignored and stay the caller's.
    bool SetSystemFontFamilies(List* families);
    bool IsSystemFontFamiliesAlreadySet();
    // The system families as set (null before); still the manager's.
    const List* GetSystemFontFamilies();

    bool GetMinikinFont(std::shared_ptr<Platform::Font>& out, const GxString* path, int ttcIndex);

    // Appends the text's own font (when `fontName` is known here; its weight
    // and slant from its name) and then every built system family.
    bool GetMinikinFontFamilies(Platform::FontFamilies& out, const GxString* fontName, int* weight);

    // Bytes of font files read so far, in units of 1,024,000 bytes.
    double GetTotalMegabytes();

private:
    GxFontManagerImpl* M = nullptr;
};

// Reads a whole file into a new[] array; null (with a log line) when it
// cannot be read or is empty.
char* getFontData(const char* path, unsigned int& size);

}  // namespace Glimmer
