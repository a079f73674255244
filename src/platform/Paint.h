#pragma once
// The paint a text object keeps: everything about how its glyphs are sized,
// slanted, spaced and rasterised. A plain value; copying it is cheap.

#include <cstdint>
#include <string>

namespace Glimmer::Platform {

struct Paint {
    // Bits of the Java paint flags that change how text is drawn here.
    static constexpr uint32_t kAntiAliasFlag = 0x01;
    static constexpr uint32_t kFakeBoldTextFlag = 0x20;
    static constexpr uint32_t kSubpixelTextFlag = 0x80;

    enum Align : int { kAlignLeft = 0, kAlignCenter = 1, kAlignRight = 2 };
    enum FamilyVariant : int { kVariantDefault = 0, kVariantCompact = 1, kVariantElegant = 2 };

    float size = 12.0f;          // pixels per em
    float scaleX = 1.0f;         // horizontal stretch of glyphs and advances
    float skewX = 0.0f;          // x += skewX * y (y down): negative leans right
    bool embolden = false;       // fake bold
    bool antiAlias = true;       // 8-bit coverage; off: every pixel on or off
    bool subpixel = false;       // off: each glyph's origin snaps to a whole pixel
    float letterSpacing = 0.0f;  // in ems, added between clusters
    int familyVariant = kVariantDefault;
    uint32_t localeListId = 0;   // from RegisterLocaleList; 0 for none
    std::string fontFeatureSettings;  // CSS syntax: "'liga' 0, 'smcp'"
    int align = kAlignLeft;           // kept for the caller; layout ignores it
    uint32_t javaFlags = kAntiAliasFlag;

    void SetJavaFlags(uint32_t flags) {
        javaFlags = flags;
        antiAlias = (flags & kAntiAliasFlag) != 0;
        embolden = (flags & kFakeBoldTextFlag) != 0;
        subpixel = (flags & kSubpixelTextFlag) != 0;
    }
};

}  // namespace Glimmer::Platform
