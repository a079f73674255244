#pragma once
// A font face on Linux: the same bytes opened twice, by HarfBuzz for shaping
// (its own OpenType code, which is read-only and so needs no lock) and by
// FreeType for glyphs. FreeType faces keep per-call state in their glyph
// slot, so every glyph request takes the font's lock; each font also has a
// FreeType library of its own, so two fonts never share anything mutable.
//
// Three kinds of glyph reach the mask, each as coverage only:
//  - outlines, scaled, emboldened, stretched and slanted as the run says;
//  - colour layers (a colour table of outline layers, each with a palette
//    colour): every layer's outline with its colour's alpha;
//  - colour bitmap strikes (fonts made only of images at fixed sizes, as
//    emoji fonts are): the alpha of the image from the strike closest to the
//    size asked for, which the rasteriser scales and slants itself.

#include <ft2build.h>
#include FT_FREETYPE_H
#include FT_OUTLINE_H
#include FT_COLOR_H
#include <hb.h>

#include <mutex>
#include <vector>

#include "platform/Font.h"
#include "platform/TextLayout.h"

namespace Glimmer::Platform {

// One glyph of a bitmap strike: its coverage at the strike's size.
struct StrikeGlyph {
    const uint8_t* coverage = nullptr;   // width x height bytes, rows packed; null for metrics only
    int width = 0;
    int height = 0;
    int left = 0;   // the bitmap's top-left corner from the glyph origin,
    int top = 0;    // in strike pixels, y up
    float ppem = 0.0f;   // the strike's size, pixels per em
};

class FontLinux final : public Font {
public:
    static std::shared_ptr<Font> Create(const char* data, size_t size, int ttcIndex,
                                        FontData ownership);
    ~FontLinux() override;

    bool HasGlyph(uint32_t codePoint) const override;
    const char* FamilyName() const override;
    uint32_t GlyphCount() const override;
    bool HasColorGlyphs() const override { return !strikes_.empty() || !palette_.empty(); }

    hb_font_t* HbFont() const { return hbFont_; }
    unsigned UnitsPerEm() const { return upem_; }

    // Whether glyphs come from colour bitmap strikes (WithStrikeGlyph)
    // rather than outlines (WithLayers).
    bool HasColorStrikes() const { return !strikes_.empty(); }

    // Loads the outline of `glyphId` scaled, emboldened, stretched and
    // slanted as `run` says, in 26.6 pixels with y up and the origin at 0,
    // and hands it to use(outline, library, alpha) under the font's lock:
    // once with alpha 255, or, for a glyph made of colour layers, once per
    // layer from the bottom up with the alpha of its colour. False when no
    // outline was handed over.
    template <typename Use>
    bool WithLayers(const RunFont& run, uint32_t glyphId, Use&& use) {
        std::lock_guard<std::mutex> lock(mutex_);
        bool used = false;
        if (!palette_.empty()) {
            FT_LayerIterator layers = {};
            FT_UInt layerGlyph = 0, colorIndex = 0;
            while (FT_Get_Color_Glyph_Layer(face_, glyphId, &layerGlyph, &colorIndex, &layers)) {
                FT_Outline* outline = LoadOutline(run, layerGlyph);
                if (outline == nullptr) continue;
                // 0xFFFF is the text's own colour, whose alpha the effects apply later.
                use(outline, library_, colorIndex < palette_.size() ? palette_[colorIndex] : uint8_t(255));
                used = true;
            }
            if (layers.p != nullptr) return used;   // a layered glyph: its own outline is not drawn
        }
        FT_Outline* outline = LoadOutline(run, glyphId);
        if (outline == nullptr) return used;
        use(outline, library_, uint8_t(255));
        return true;
    }

    // The coverage of `glyphId` in the strike for `size` pixels per em,
    // handed to use(const StrikeGlyph&) under the font's lock; with
    // `metricsOnly` the image is not decoded. False for a glyph the strike
    // lacks or cannot read.
    template <typename Use>
    bool WithStrikeGlyph(float size, uint32_t glyphId, bool metricsOnly, Use&& use) {
        std::lock_guard<std::mutex> lock(mutex_);
        const StrikeGlyph* glyph = LoadStrikeGlyph(size, glyphId, metricsOnly);
        if (glyph == nullptr) return false;
        use(*glyph);
        return true;
    }

private:
    FontLinux() = default;
    FT_Outline* LoadOutline(const RunFont& run, uint32_t glyphId);
    const StrikeGlyph* LoadStrikeGlyph(float size, uint32_t glyphId, bool metricsOnly);
    bool SelectStrike(float size);
    bool CanReadAStrikeGlyph();

    std::mutex mutex_;
    FT_Library library_ = nullptr;
    FT_Face face_ = nullptr;
    hb_blob_t* blob_ = nullptr;
    hb_face_t* hbFace_ = nullptr;
    hb_font_t* hbFont_ = nullptr;
    unsigned upem_ = 1000;
    const char* ownedData_ = nullptr;
    std::vector<uint8_t> palette_;   // alpha of each colour of the first palette
    struct Strike {
        int index;
        float ppem;
    };
    std::vector<Strike> strikes_;    // by size, smallest first
    int selectedStrike_ = -1;        // index into strikes_
    StrikeGlyph strikeGlyph_;
    std::vector<uint8_t> strikeCoverage_;
};

}  // namespace Glimmer::Platform
