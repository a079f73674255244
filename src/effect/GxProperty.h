#pragma once
// Parameter records of the effect layers, and their key serialisation.
//
// The stack builds a record from clamped arguments, the layer keeps its own
// copy, the filter reads it. Records hold plain values and borrowed pointers
// (gradient stops, pattern tile): copying a record copies the pointers. A
// layer that must outlive the caller's stops calls copyStops() on its copy.
//
// Serialisation: toSequentialChar writes the record's bytes at *cursor,
// advances the cursor and always leaves a zero byte after the last byte
// written, so the buffer needs getSequentialCharLength() + 1 bytes. Every
// byte written has its top bit set, so a key never contains a zero byte.

#include <cstdint>

#include "foundation/GxBitmap.h"

namespace Glimmer {

// One stop of a colour ramp: 12 bytes.
struct GxGradient {
    uint32_t color = 0;     // 0xAARRGGBB
    float opacity = 0.0f;   // folded into color's alpha by the stack; not serialised
    float position = 0.0f;  // 0.0 .. 1.0
};
static_assert(sizeof(GxGradient) == 12, "a stop is three 32-bit words");

// A private copy of `count` stops (array-new, nothrow); null for null stops,
// count <= 0 or a failed allocation.
GxGradient* GxCopyGradientStops(const GxGradient* stops, int32_t count);

class GxProperty {
public:
    GxProperty(uint32_t color, float opacity) : color(color), opacity(opacity) {}
    virtual ~GxProperty() {}

    virtual int getSequentialCharLength() const = 0;
    virtual bool toSequentialChar(char** cursor) const = 0;

    uint32_t color;  // 0xAARRGGBB; 0 for records without a single colour
    float opacity;
};

class GxTextProperty : public GxProperty {
public:
    GxTextProperty(uint32_t color, float opacity);
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;
};

class GxOuterShadowProperty : public GxProperty {
public:
    GxOuterShadowProperty(float angle, float distance, float size, uint32_t color, float opacity);
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    float angle;     // degrees
    float distance;  // pixels
    float size;      // blur radius, pixels

protected:
    bool writeAs(char letter, char** cursor) const;
};

// Same fields as the outer shadow; the angle is stored truncated and reduced
// modulo 360 with the sign of the dividend (-30.7 -> -30, 400 -> 40).
class GxInnerShadowProperty : public GxOuterShadowProperty {
public:
    GxInnerShadowProperty(float angle, float distance, float size, uint32_t color, float opacity);
    bool toSequentialChar(char** cursor) const override;
};

class GxStrokeProperty : public GxProperty {
public:
    GxStrokeProperty(float size, uint32_t color, float opacity, int32_t a, int32_t position);
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    float size;        // stroke width, pixels
    int32_t a;         // written into the key; the stroke filter does not read it
    int32_t position;  // 0 centre, 1 outside, 2 inside
};

class GxOuterGlowProperty : public GxProperty {
public:
    GxOuterGlowProperty(float size, uint32_t color, float opacity, int32_t count, GxGradient* stops);
    GxOuterGlowProperty(const GxOuterGlowProperty& other);
    GxOuterGlowProperty& operator=(const GxOuterGlowProperty& other);
    ~GxOuterGlowProperty() override;
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    // Replaces `stops` with a private copy freed by this record; false (and
    // no stops) when the copy could not be made.
    bool copyStops();

    float size;
    int32_t count;
    GxGradient* stops;

protected:
    bool writeAs(char letter, char** cursor) const;

private:
    bool ownsStops_ = false;
};

class GxInnerGlowProperty : public GxOuterGlowProperty {
public:
    GxInnerGlowProperty(float size, uint32_t color, float opacity, int32_t count, GxGradient* stops);
    bool toSequentialChar(char** cursor) const override;
};

// color 0; angle truncated modulo 360 (sign kept); scale clamped to 0..2.
class GxLinearGradientProperty : public GxProperty {
public:
    GxLinearGradientProperty(float angle, float scale, float opacity, int32_t count,
                             GxGradient* stops);
    GxLinearGradientProperty(const GxLinearGradientProperty& other);
    GxLinearGradientProperty& operator=(const GxLinearGradientProperty& other);
    ~GxLinearGradientProperty() override;
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    // As GxOuterGlowProperty::copyStops.
    bool copyStops();

    float angle;
    float scale;
    int32_t count;
    GxGradient* stops;

protected:
    bool writeAs(char letter, char** cursor) const;

private:
    bool ownsStops_ = false;
};

class GxRadialGradientProperty : public GxLinearGradientProperty {
public:
    GxRadialGradientProperty(float angle, float scale, float opacity, int32_t count,
                             GxGradient* stops);
    bool toSequentialChar(char** cursor) const override;
};

// color 0, opacity the layer opacity. Depth is clamped to 0..10 and soften to
// 0..16; size is not clamped (large bevels are legitimate). Angle truncated
// modulo 360, altitude truncated modulo 90, both keeping their sign.
class GxBevelProperty : public GxProperty {
public:
    GxBevelProperty(int32_t style, float depth, float size, int32_t direction, int32_t technique,
                    int32_t soften, float opacity, float angle, float altitude,
                    uint32_t highlightColor, float highlightOpacity, uint32_t shadowColor,
                    float shadowOpacity);
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    int32_t style;      // bevel: 1 inside the glyph, else outside; emboss: 3 two-sided
    float depth;        // 0..10, steepness
    float size;         // pixels
    int32_t direction;  // 0 flips the light's horizontal components
    int32_t technique;  // 0 smooth, else hard
    int32_t soften;     // 0..16
    float angle;        // degrees
    float altitude;     // degrees
    uint32_t highlightColor;
    float highlightOpacity;
    uint32_t shadowColor;
    float shadowOpacity;

protected:
    bool writeAs(char letter, char** cursor) const;
};

class GxEmbossProperty : public GxBevelProperty {
public:
    GxEmbossProperty(int32_t style, float depth, float size, int32_t direction, int32_t technique,
                     int32_t soften, float opacity, float angle, float altitude,
                     uint32_t highlightColor, float highlightOpacity, uint32_t shadowColor,
                     float shadowOpacity);
    bool toSequentialChar(char** cursor) const override;
};

// color 0; the tile is borrowed (the pattern layer copies it); scale 0..10.
class GxPatternProperty : public GxProperty {
public:
    GxPatternProperty(GxBitmap* tile, float scale, float opacity);
    int getSequentialCharLength() const override;
    bool toSequentialChar(char** cursor) const override;

    GxBitmap* tile;
    float scale;
};

}  // namespace Glimmer
