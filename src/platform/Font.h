#pragma once
// Fonts as the text stack sees them: a font face made from bytes in memory, a
// family of such faces with their styles, and a typeface (an ordered list of
// families plus the style asked for) that layout searches for each character.
//
// Nothing here says how a face is read or drawn; that is the platform's
// business (src/platform/linux/ on Linux). Fonts are immutable once made and
// may be used from several threads at once.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

namespace Glimmer::Platform {

class Font {
public:
    virtual ~Font() = default;
    // Whether the face maps this code point to a glyph of its own.
    virtual bool HasGlyph(uint32_t codePoint) const = 0;
    // The face's family name as the font file states it ("" when it has none).
    virtual const char* FamilyName() const = 0;
    virtual uint32_t GlyphCount() const = 0;
    // Whether its glyphs are in colour (emoji fonts): such a font is
    // preferred for emoji, and its glyphs' coverage is their colour's alpha.
    virtual bool HasColorGlyphs() const { return false; }
};

// Who frees the bytes a font is made from.
enum class FontData {
    kBorrowed,     // the caller keeps them alive for as long as the font lives
    kAdoptArray,   // the font frees them with delete[] when it goes (only on success)
};

// Face `ttcIndex` of the font (or font collection) in `data`. The bytes are
// not copied. Null when they are no font the platform can read, when the
// index is not in the collection, or when size or index are out of range;
// the caller then still owns the bytes whatever `ownership` says.
std::shared_ptr<Font> CreateFont(const char* data, size_t size, int ttcIndex, FontData ownership);

// One family: faces of one design in several weights and slants, tagged with
// the locale list it serves (0 for none) and a variant (0 default).
struct FontFamily {
    struct Member {
        std::shared_ptr<Font> font;
        int weight = 400;
        bool italic = false;
    };

    FontFamily(uint32_t localeListId, int variant, std::vector<Member> fonts)
        : localeListId(localeListId), variant(variant), fonts(std::move(fonts)) {}

    uint32_t localeListId = 0;
    int variant = 0;
    std::vector<Member> fonts;
};

using FontFamilies = std::vector<std::shared_ptr<FontFamily>>;

// What layout shapes with: families in the order they are tried, and the
// weight and slant asked for.
struct Typeface {
    FontFamilies families;
    int weight = 400;
    bool italic = false;
    // Whether a character no family has may come from the system's
    // last-resort fonts (SystemFallbackFont): where the system's families
    // are in use.
    bool systemFallback = false;
};

std::shared_ptr<Typeface> CreateTypefaceFromFamilies(const FontFamilies& families, int weight,
                                                     bool italic);

}  // namespace Glimmer::Platform
