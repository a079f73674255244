#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_TRUETYPE_TABLES_H

#include "platform/FontMetrics.h"

namespace Glimmer::Platform {

bool ReadFontMetrics(const char* bytes, size_t size, FontMetrics* out) {
    if (out == nullptr || bytes == nullptr) return false;
    FT_Library library = nullptr;
    if (FT_Init_FreeType(&library) != 0) return false;
    FT_Face face = nullptr;
    bool ok = FT_New_Memory_Face(library, reinterpret_cast<const FT_Byte*>(bytes), FT_Long(size), 0, &face) == 0;
    if (ok) {
        out->familyName = face->family_name != nullptr ? face->family_name : "";
        out->unitsPerEm = float(face->units_per_EM);
        out->boxTop = float(face->bbox.yMax);
        out->boxBottom = float(face->bbox.yMin);
        out->ascent = float(face->ascender);
        out->descent = float(face->descender);
        // FreeType leaves these unset for faces without outlines (colour
        // emoji strikes); their header tables still have them.
        const auto* head = static_cast<const TT_Header*>(FT_Get_Sfnt_Table(face, FT_SFNT_HEAD));
        const auto* hhea = static_cast<const TT_HoriHeader*>(FT_Get_Sfnt_Table(face, FT_SFNT_HHEA));
        if (face->units_per_EM == 0 && head != nullptr && hhea != nullptr) {
            out->unitsPerEm = float(head->Units_Per_EM);
            out->boxTop = float(head->yMax);
            out->boxBottom = float(head->yMin);
            out->ascent = float(hhea->Ascender);
            out->descent = float(hhea->Descender);
        }
        ok = out->unitsPerEm > 0.0f;
        const auto* os2 = static_cast<const TT_OS2*>(FT_Get_Sfnt_Table(face, FT_SFNT_OS2));
        if (ok && os2 != nullptr && os2->version != 0xFFFF && (os2->fsSelection & (1u << 7)) != 0) {  // USE_TYPO_METRICS
            out->ascent = float(os2->sTypoAscender);
            out->descent = float(os2->sTypoDescender);
        }
    }
    if (face != nullptr) FT_Done_Face(face);
    FT_Done_FreeType(library);
    return ok;
}

}  // namespace Glimmer::Platform
