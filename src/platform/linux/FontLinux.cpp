#include "platform/linux/FontLinux.h"

#include <climits>
#include <cmath>
#include <new>

namespace Glimmer::Platform {
namespace {

FT_Fixed ToFixed(float value) { return FT_Fixed(std::lroundf(value * 65536.0f)); }

// Fake bold widens every stroke by a share of the size: 1/24 of it for small
// text, falling linearly to 1/32 from 9 to 36 pixels, so that thin small
// text gains visibly and large text does not blot.
float FakeBoldStrength(float size) {
    constexpr float kSmallSize = 9.0f, kLargeSize = 36.0f;
    constexpr float kSmallRatio = 1.0f / 24.0f, kLargeRatio = 1.0f / 32.0f;
    float ratio;
    if (size <= kSmallSize) {
        ratio = kSmallRatio;
    } else if (size >= kLargeSize) {
        ratio = kLargeRatio;
    } else {
        ratio = kSmallRatio + (kLargeRatio - kSmallRatio) * (size - kSmallSize) / (kLargeSize - kSmallSize);
    }
    return size * ratio;
}

}  // namespace

std::shared_ptr<Font> FontLinux::Create(const char* data, size_t size, int ttcIndex,
                                        FontData ownership) {
    // Indices above 0xFFFF select variation instances in FreeType; a face of a
    // collection is all we take.
    if (data == nullptr || size == 0 || size > UINT_MAX || size > size_t(LONG_MAX) || ttcIndex < 0 ||
        ttcIndex > 0xFFFF) {
        return nullptr;
    }
    std::shared_ptr<FontLinux> font(new (std::nothrow) FontLinux());
    if (font == nullptr) return nullptr;
    if (FT_Init_FreeType(&font->library_) != 0) {
        font->library_ = nullptr;
        return nullptr;
    }
    if (FT_New_Memory_Face(font->library_, reinterpret_cast<const FT_Byte*>(data), FT_Long(size),
                           FT_Long(ttcIndex), &font->face_) != 0) {
        font->face_ = nullptr;
        return nullptr;
    }
    // Only outlines can be scaled, slanted and emboldened the way text is drawn.
    if (!FT_IS_SCALABLE(font->face_) || font->face_->units_per_EM == 0) return nullptr;
    font->upem_ = font->face_->units_per_EM;

    font->blob_ = hb_blob_create(data, unsigned(size), HB_MEMORY_MODE_READONLY, nullptr, nullptr);
    font->hbFace_ = hb_face_create(font->blob_, unsigned(ttcIndex));
    font->hbFont_ = hb_font_create(font->hbFace_);
    // Shaping runs in font units; layout scales the results itself.
    hb_font_set_scale(font->hbFont_, int(font->upem_), int(font->upem_));
    hb_font_make_immutable(font->hbFont_);

    if (ownership == FontData::kAdoptArray) font->ownedData_ = data;
    return font;
}

FontLinux::~FontLinux() {
    if (hbFont_ != nullptr) hb_font_destroy(hbFont_);
    if (hbFace_ != nullptr) hb_face_destroy(hbFace_);
    if (blob_ != nullptr) hb_blob_destroy(blob_);
    if (face_ != nullptr) FT_Done_Face(face_);
    if (library_ != nullptr) FT_Done_FreeType(library_);
    delete[] ownedData_;
}

bool FontLinux::HasGlyph(uint32_t codePoint) const {
    hb_codepoint_t glyph = 0;
    return hb_font_get_nominal_glyph(hbFont_, codePoint, &glyph) != 0;
}

const char* FontLinux::FamilyName() const {
    return face_->family_name != nullptr ? face_->family_name : "";
}

uint32_t FontLinux::GlyphCount() const { return uint32_t(face_->num_glyphs); }

FT_Outline* FontLinux::LoadOutline(const RunFont& run, uint32_t glyphId) {
    if (FT_Load_Glyph(face_, glyphId, FT_LOAD_NO_SCALE | FT_LOAD_NO_BITMAP) != 0) return nullptr;
    FT_GlyphSlot slot = face_->glyph;
    if (slot->format != FT_GLYPH_FORMAT_OUTLINE) return nullptr;
    FT_Outline* outline = &slot->outline;

    // Font units to 26.6 pixels at the text size; then the fake bold stroke
    // at that size; then the stretch and the slant, which act on the
    // emboldened shape as they act on the plain one.
    FT_Fixed scale = ToFixed(run.size * 64.0f / float(upem_));
    FT_Matrix toPixels = {scale, 0, 0, scale};
    FT_Outline_Transform(outline, &toPixels);
    if (run.embolden) {
        FT_Outline_Embolden(outline, FT_Pos(std::lroundf(FakeBoldStrength(run.size) * 64.0f)));
    }
    if (run.scaleX != 1.0f || run.skewX != 0.0f) {
        // y is up here, so a skew that moves x by skewX * y(down) moves it by
        // -skewX * y(up).
        FT_Matrix shape = {ToFixed(run.scaleX), ToFixed(-run.skewX), 0, 0x10000};
        FT_Outline_Transform(outline, &shape);
    }
    return outline;
}

std::shared_ptr<Font> CreateFont(const char* data, size_t size, int ttcIndex, FontData ownership) {
    return FontLinux::Create(data, size, ttcIndex, ownership);
}

std::shared_ptr<Typeface> CreateTypefaceFromFamilies(const FontFamilies& families, int weight,
                                                     bool italic) {
    auto typeface = std::make_shared<Typeface>();
    typeface->families = families;
    typeface->weight = weight;
    typeface->italic = italic;
    return typeface;
}

}  // namespace Glimmer::Platform
