#include "platform/linux/FontLinux.h"

#include <algorithm>
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
    FT_Face face = font->face_;
    const bool outlines = FT_IS_SCALABLE(face) && face->units_per_EM != 0;
    if (!outlines) {
        // Without outlines only colour strikes are taken: the image of a
        // glyph scales to any size, where a plain bitmap font would not.
        if (!FT_HAS_COLOR(face) || !FT_HAS_FIXED_SIZES(face)) return nullptr;
        for (int i = 0; i < face->num_fixed_sizes; ++i) {
            const float ppem = float(face->available_sizes[i].y_ppem) / 64.0f;
            if (ppem >= 1.0f) font->strikes_.push_back({i, ppem});
        }
        std::sort(font->strikes_.begin(), font->strikes_.end(),
                  [](const Strike& a, const Strike& b) { return a.ppem < b.ppem; });
        if (font->strikes_.empty() || !font->CanReadAStrikeGlyph()) return nullptr;
    }

    font->blob_ = hb_blob_create(data, unsigned(size), HB_MEMORY_MODE_READONLY, nullptr, nullptr);
    font->hbFace_ = hb_face_create(font->blob_, unsigned(ttcIndex));
    // FreeType leaves the size of the em unset for faces without outlines.
    font->upem_ = outlines ? face->units_per_EM : hb_face_get_upem(font->hbFace_);
    if (font->upem_ == 0) return nullptr;
    font->hbFont_ = hb_font_create(font->hbFace_);
    // Shaping runs in font units; layout scales the results itself.
    hb_font_set_scale(font->hbFont_, int(font->upem_), int(font->upem_));
    hb_font_make_immutable(font->hbFont_);

    if (outlines && FT_HAS_COLOR(face)) {
        FT_Palette_Data palettes;
        FT_Color* colors = nullptr;
        if (FT_Palette_Data_Get(face, &palettes) == 0 && palettes.num_palettes > 0 &&
            FT_Palette_Select(face, 0, &colors) == 0 && colors != nullptr) {
            for (FT_UShort i = 0; i < palettes.num_palette_entries; ++i) font->palette_.push_back(colors[i].alpha);
        }
    }

    if (ownership == FontData::kAdoptArray) font->ownedData_ = data;
    return font;
}

// A face whose strikes cannot give a single image of the first characters it
// maps (blank ones aside) is broken, a damaged image table, however well its
// tables parse.
bool FontLinux::CanReadAStrikeGlyph() {
    constexpr int kTries = 64;
    FT_UInt glyph = 0;
    FT_ULong code = FT_Get_First_Char(face_, &glyph);
    for (int tries = 0; glyph != 0 && tries < kTries; ++tries) {
        const StrikeGlyph* image = LoadStrikeGlyph(strikes_.back().ppem, glyph, false);
        if (image != nullptr && image->width > 0 && image->height > 0) return true;   // blanks prove nothing
        code = FT_Get_Next_Char(face_, code, &glyph);
    }
    return false;
}

bool FontLinux::SelectStrike(float size) {
    // The smallest strike at least as large as the text, else the largest:
    // scaling an image down loses less than scaling it up.
    int chosen = int(strikes_.size()) - 1;
    for (size_t i = 0; i < strikes_.size(); ++i) {
        if (strikes_[i].ppem >= size) {
            chosen = int(i);
            break;
        }
    }
    if (chosen == selectedStrike_) return true;
    selectedStrike_ = -1;
    if (FT_Select_Size(face_, strikes_[size_t(chosen)].index) != 0) return false;
    selectedStrike_ = chosen;
    return true;
}

const StrikeGlyph* FontLinux::LoadStrikeGlyph(float size, uint32_t glyphId, bool metricsOnly) {
    if (strikes_.empty() || !SelectStrike(size)) return nullptr;
    FT_Int32 flags = FT_LOAD_COLOR | (metricsOnly ? FT_LOAD_BITMAP_METRICS_ONLY : 0);
    if (FT_Load_Glyph(face_, glyphId, flags) != 0) return nullptr;
    FT_GlyphSlot slot = face_->glyph;
    if (slot->format != FT_GLYPH_FORMAT_BITMAP) return nullptr;
    const FT_Bitmap& bitmap = slot->bitmap;
    constexpr unsigned kMaxSide = 4096;   // no strike holds larger images
    if (bitmap.width > kMaxSide || bitmap.rows > kMaxSide) return nullptr;
    StrikeGlyph& glyph = strikeGlyph_;
    glyph = StrikeGlyph();
    glyph.width = int(bitmap.width);
    glyph.height = int(bitmap.rows);
    glyph.left = slot->bitmap_left;
    glyph.top = slot->bitmap_top;
    glyph.ppem = strikes_[size_t(selectedStrike_)].ppem;
    if (metricsOnly) return &glyph;

    const size_t width = bitmap.width, rows = bitmap.rows;
    const size_t pitch = size_t(bitmap.pitch < 0 ? -bitmap.pitch : bitmap.pitch);
    if (bitmap.buffer == nullptr && width * rows > 0) return nullptr;
    strikeCoverage_.resize(width * rows);
    for (size_t y = 0; y < rows; ++y) {
        // A negative pitch stores the rows bottom up.
        const unsigned char* row = bitmap.buffer + (bitmap.pitch < 0 ? rows - 1 - y : y) * pitch;
        uint8_t* out = strikeCoverage_.data() + y * width;
        switch (bitmap.pixel_mode) {
            case FT_PIXEL_MODE_BGRA:
                for (size_t x = 0; x < width; ++x) out[x] = row[4 * x + 3];
                break;
            case FT_PIXEL_MODE_GRAY:
                if (bitmap.num_grays != 256) return nullptr;
                std::copy(row, row + width, out);
                break;
            case FT_PIXEL_MODE_MONO:
                for (size_t x = 0; x < width; ++x) out[x] = (row[x >> 3] >> (7 - (x & 7)) & 1) != 0 ? 255 : 0;
                break;
            default:
                return nullptr;
        }
    }
    glyph.coverage = strikeCoverage_.data();
    return &glyph;
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
