#pragma once
// The vertical metrics of a font file, read without making a font of it:
// what line layout needs to place lines before any glyph is shaped.

#include <cstddef>
#include <string>

namespace Glimmer::Platform {

// Font units, y up. The box is the font's bounds; ascent and descent come
// from the horizontal header, or the typographic ones when the font asks for
// them (and from the header tables for faces without outlines, such as
// colour bitmap emoji).
struct FontMetrics {
    std::string familyName;
    float unitsPerEm = 0.0f;
    float boxTop = 0.0f;
    float boxBottom = 0.0f;
    float ascent = 0.0f;
    float descent = 0.0f;
};

// Metrics of face 0 of the font in `bytes`; false when it is no font the
// platform can read, or it has no units per em.
bool ReadFontMetrics(const char* bytes, size_t size, FontMetrics* out);

}  // namespace Glimmer::Platform
