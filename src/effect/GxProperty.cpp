#include "effect/GxProperty.h"

#include <cstdint>
#include <new>

#include "effect/GxEffectMath.h"

// Key pieces. Every byte carries 0x80 so that a key is a plain zero-terminated
// string: colours as eight nibbles, small numbers as seven bits, angles as two
// seven-bit halves, larger numbers as two or four nibbles. A zero byte follows
// every record, so the last record leaves the key terminated.

namespace Glimmer {

using EffectMath::ClampFloat;
using EffectMath::ClampInt;
using EffectMath::FoldDegrees;
using EffectMath::TruncToInt;

namespace {

class KeyWriter {
public:
    explicit KeyWriter(char** cursor) : cursor_(cursor), p_(reinterpret_cast<unsigned char*>(*cursor)) {}
    ~KeyWriter() {
        *p_ = 0;
        *cursor_ = reinterpret_cast<char*>(p_);
    }

    void Letter(char c) { *p_++ = static_cast<unsigned char>(c); }
    void Color(uint32_t c) {
        for (int shift = 28; shift >= 0; shift -= 4) *p_++ = 0x80 | ((c >> shift) & 0xF);
    }
    void Small(float v) { *p_++ = 0x80 | (TruncToInt(v) & 0x7F); }
    void Small(int32_t v) { *p_++ = 0x80 | (v & 0x7F); }
    void Angle(float v) {
        int32_t a = TruncToInt(v) % 360;
        if (a < 0) a += 360;
        *p_++ = 0x80 | (a >> 7);
        *p_++ = 0x80 | (a & 0x7F);
    }
    void TwoNibbles(float v) {
        int32_t n = TruncToInt(v);
        *p_++ = 0x80 | ((n >> 4) & 15);
        *p_++ = 0x80 | (n & 15);
    }
    void FourNibbles(float v) {
        int32_t n = TruncToInt(v);
        for (int shift = 12; shift >= 0; shift -= 4) *p_++ = 0x80 | ((n >> shift) & 15);
    }
    // A null array writes nothing whatever the count: never read a stop
    // that is not there.
    void Stops(const GxGradient* stops, int32_t count) {
        if (stops == nullptr) return;
        for (int32_t i = 0; i < count; ++i) {
            Color(stops[i].color);
            Small(stops[i].position * 100.0f);
        }
    }

private:
    char** cursor_;
    unsigned char* p_;
};

// Reserved bytes for a record with `count` stops: `perStop` each plus `fixed`.
// Saturates, so an absurd count makes the key too long to build rather than
// wrapping to a short buffer.
int StopsLength(int32_t count, int fixed) {
    if (count < 0) count = 0;
    int64_t n = int64_t(count) * 10 + fixed;
    return n > INT32_MAX ? INT32_MAX : int(n);
}

}  // namespace

GxGradient* GxCopyGradientStops(const GxGradient* stops, int32_t count) {
    if (stops == nullptr || count <= 0) return nullptr;
    GxGradient* copy = new (std::nothrow) GxGradient[size_t(count)];
    if (copy == nullptr) return nullptr;
    for (int32_t i = 0; i < count; ++i) copy[i] = stops[i];
    return copy;
}

namespace {

// The glow and gradient records either borrow their stops or own a private
// copy that they free; these two keep that ownership straight for both.
void DropOwnedStops(GxGradient* stops, bool* owns) {
    if (*owns) delete[] stops;
    *owns = false;
}

bool TakePrivateStops(GxGradient** stops, int32_t count, bool* owns) {
    GxGradient* copy = GxCopyGradientStops(*stops, count);
    bool ok = copy != nullptr || *stops == nullptr || count <= 0;
    if (*owns) delete[] *stops;
    *stops = copy;
    *owns = copy != nullptr;
    return ok;
}

}  // namespace

// --- text

GxTextProperty::GxTextProperty(uint32_t color, float opacity) : GxProperty(color, opacity) {}

int GxTextProperty::getSequentialCharLength() const { return 9; }

bool GxTextProperty::toSequentialChar(char** cursor) const {
    KeyWriter w(cursor);
    w.Letter('T');
    w.Color(color);
    return true;
}

// --- shadows

GxOuterShadowProperty::GxOuterShadowProperty(float angle, float distance, float size,
                                             uint32_t color, float opacity)
    : GxProperty(color, opacity), angle(angle), distance(distance), size(size) {}

int GxOuterShadowProperty::getSequentialCharLength() const { return 13; }

bool GxOuterShadowProperty::toSequentialChar(char** cursor) const { return writeAs('S', cursor); }

bool GxOuterShadowProperty::writeAs(char letter, char** cursor) const {
    KeyWriter w(cursor);
    w.Letter(letter);
    w.Angle(angle);
    w.Small(distance);
    w.Small(size);
    w.Color(color);
    return true;
}

GxInnerShadowProperty::GxInnerShadowProperty(float angle, float distance, float size,
                                             uint32_t color, float opacity)
    : GxOuterShadowProperty(FoldDegrees(angle, 360), distance, size, color, opacity) {}

bool GxInnerShadowProperty::toSequentialChar(char** cursor) const { return writeAs('I', cursor); }

// --- stroke

GxStrokeProperty::GxStrokeProperty(float size, uint32_t color, float opacity, int32_t a,
                                   int32_t position)
    : GxProperty(color, opacity), size(size), a(a), position(position) {}

int GxStrokeProperty::getSequentialCharLength() const { return 12; }

bool GxStrokeProperty::toSequentialChar(char** cursor) const {
    KeyWriter w(cursor);
    w.Letter('K');
    w.Small(size);
    w.Color(color);
    w.Small(a);
    w.Small(position);
    return true;
}

// --- glows

GxOuterGlowProperty::GxOuterGlowProperty(float size, uint32_t color, float opacity, int32_t count,
                                         GxGradient* stops)
    : GxProperty(color, opacity), size(size), count(count), stops(stops) {}

// A copy borrows the stops, even from a record that owns its own.
GxOuterGlowProperty::GxOuterGlowProperty(const GxOuterGlowProperty& other)
    : GxProperty(other), size(other.size), count(other.count), stops(other.stops) {}

GxOuterGlowProperty& GxOuterGlowProperty::operator=(const GxOuterGlowProperty& other) {
    if (this == &other) return *this;
    DropOwnedStops(stops, &ownsStops_);
    GxProperty::operator=(other);
    size = other.size;
    count = other.count;
    stops = other.stops;
    return *this;
}

GxOuterGlowProperty::~GxOuterGlowProperty() { DropOwnedStops(stops, &ownsStops_); }

bool GxOuterGlowProperty::copyStops() { return TakePrivateStops(&stops, count, &ownsStops_); }

int GxOuterGlowProperty::getSequentialCharLength() const { return StopsLength(count, 10); }

bool GxOuterGlowProperty::toSequentialChar(char** cursor) const { return writeAs('G', cursor); }

bool GxOuterGlowProperty::writeAs(char letter, char** cursor) const {
    KeyWriter w(cursor);
    w.Letter(letter);
    w.Small(size);
    w.Color(color);
    w.Stops(stops, count);
    return true;
}

GxInnerGlowProperty::GxInnerGlowProperty(float size, uint32_t color, float opacity, int32_t count,
                                         GxGradient* stops)
    : GxOuterGlowProperty(size, color, opacity, count, stops) {}

bool GxInnerGlowProperty::toSequentialChar(char** cursor) const { return writeAs('N', cursor); }

// --- gradient fills

GxLinearGradientProperty::GxLinearGradientProperty(float angle, float scale, float opacity,
                                                   int32_t count, GxGradient* stops)
    : GxProperty(0, opacity),
      angle(FoldDegrees(angle, 360)),
      scale(ClampFloat(scale, 0.0f, 2.0f)),
      count(count),
      stops(stops) {}

GxLinearGradientProperty::GxLinearGradientProperty(const GxLinearGradientProperty& other)
    : GxProperty(other), angle(other.angle), scale(other.scale), count(other.count),
      stops(other.stops) {}

GxLinearGradientProperty& GxLinearGradientProperty::operator=(const GxLinearGradientProperty& other) {
    if (this == &other) return *this;
    DropOwnedStops(stops, &ownsStops_);
    GxProperty::operator=(other);
    angle = other.angle;
    scale = other.scale;
    count = other.count;
    stops = other.stops;
    return *this;
}

GxLinearGradientProperty::~GxLinearGradientProperty() { DropOwnedStops(stops, &ownsStops_); }

bool GxLinearGradientProperty::copyStops() { return TakePrivateStops(&stops, count, &ownsStops_); }

int GxLinearGradientProperty::getSequentialCharLength() const { return StopsLength(count, 5); }

bool GxLinearGradientProperty::toSequentialChar(char** cursor) const { return writeAs('L', cursor); }

bool GxLinearGradientProperty::writeAs(char letter, char** cursor) const {
    KeyWriter w(cursor);
    w.Letter(letter);
    w.Angle(angle);
    w.TwoNibbles(scale * 100.0f);
    w.Stops(stops, count);
    return true;
}

GxRadialGradientProperty::GxRadialGradientProperty(float angle, float scale, float opacity,
                                                   int32_t count, GxGradient* stops)
    : GxLinearGradientProperty(angle, scale, opacity, count, stops) {}

bool GxRadialGradientProperty::toSequentialChar(char** cursor) const { return writeAs('D', cursor); }

// --- bevel and emboss

GxBevelProperty::GxBevelProperty(int32_t style, float depth, float size, int32_t direction,
                                 int32_t technique, int32_t soften, float opacity, float angle,
                                 float altitude, uint32_t highlightColor, float highlightOpacity,
                                 uint32_t shadowColor, float shadowOpacity)
    : GxProperty(0, opacity),
      style(style),
      depth(ClampFloat(depth, 0.0f, 10.0f)),
      size(size),
      direction(direction),
      technique(technique),
      soften(ClampInt(soften, 0, 16)),
      angle(FoldDegrees(angle, 360)),
      altitude(FoldDegrees(altitude, 90)),
      highlightColor(highlightColor),
      highlightOpacity(highlightOpacity),
      shadowColor(shadowColor),
      shadowOpacity(shadowOpacity) {}

int GxBevelProperty::getSequentialCharLength() const { return 30; }

bool GxBevelProperty::toSequentialChar(char** cursor) const { return writeAs('B', cursor); }

bool GxBevelProperty::writeAs(char letter, char** cursor) const {
    KeyWriter w(cursor);
    w.Letter(letter);
    w.Small(style);
    w.TwoNibbles(depth);
    w.FourNibbles(size * 100.0f);
    w.Small(direction);
    w.Small(technique);
    w.Small(soften);
    w.Angle(angle);
    w.Small(altitude);
    w.Color(highlightColor);
    w.Color(shadowColor);
    return true;
}

GxEmbossProperty::GxEmbossProperty(int32_t style, float depth, float size, int32_t direction,
                                   int32_t technique, int32_t soften, float opacity, float angle,
                                   float altitude, uint32_t highlightColor, float highlightOpacity,
                                   uint32_t shadowColor, float shadowOpacity)
    : GxBevelProperty(style, depth, size, direction, technique, soften, opacity, angle, altitude,
                      highlightColor, highlightOpacity, shadowColor, shadowOpacity) {}

bool GxEmbossProperty::toSequentialChar(char** cursor) const { return writeAs('E', cursor); }

// --- pattern

GxPatternProperty::GxPatternProperty(GxBitmap* tile, float scale, float opacity)
    : GxProperty(0, opacity), tile(tile), scale(ClampFloat(scale, 0.0f, 10.0f)) {}

int GxPatternProperty::getSequentialCharLength() const { return 17; }

bool GxPatternProperty::toSequentialChar(char** cursor) const {
    KeyWriter w(cursor);
    w.Letter('P');
    w.Color(color);
    w.FourNibbles(scale * 100.0f);
    w.FourNibbles(opacity * 100.0f);
    return true;
}

}  // namespace Glimmer
