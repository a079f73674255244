#pragma once
// A font face on Linux: the same bytes opened twice, by HarfBuzz for shaping
// (its own OpenType code, which is read-only and so needs no lock) and by
// FreeType for outlines. FreeType faces keep per-call state in their glyph
// slot, so every outline request takes the font's lock; each font also has a
// FreeType library of its own, so two fonts never share anything mutable.

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_OUTLINE_H
#include <hb.h>

#include <mutex>

#include "platform/Font.h"
#include "platform/TextLayout.h"

namespace Glimmer::Platform {

class FontLinux final : public Font {
public:
    static std::shared_ptr<Font> Create(const char* data, size_t size, int ttcIndex,
                                        FontData ownership);
    ~FontLinux() override;

    bool HasGlyph(uint32_t codePoint) const override;
    const char* FamilyName() const override;
    uint32_t GlyphCount() const override;

    hb_font_t* HbFont() const { return hbFont_; }
    unsigned UnitsPerEm() const { return upem_; }

    // Loads the outline of `glyphId` scaled, emboldened, stretched and
    // slanted as `run` says, in 26.6 pixels with y up and the origin at 0,
    // and hands it to `use` under the font's lock. False for a glyph without
    // an outline.
    template <typename Use>
    bool WithOutline(const RunFont& run, uint32_t glyphId, Use&& use) {
        std::lock_guard<std::mutex> lock(mutex_);
        FT_Outline* outline = LoadOutline(run, glyphId);
        if (outline == nullptr) return false;
        use(outline, library_);
        return true;
    }

private:
    FontLinux() = default;
    FT_Outline* LoadOutline(const RunFont& run, uint32_t glyphId);

    std::mutex mutex_;
    FT_Library library_ = nullptr;
    FT_Face face_ = nullptr;
    hb_blob_t* blob_ = nullptr;
    hb_face_t* hbFace_ = nullptr;
    hb_font_t* hbFont_ = nullptr;
    unsigned upem_ = 1000;
    const char* ownedData_ = nullptr;
};

}  // namespace Glimmer::Platform
