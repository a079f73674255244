// Line layout on Linux: bidi runs from ICU, shaping from HarfBuzz.
//
// A line is laid out in four steps.
//  1. Directional runs. ICU's bidi algorithm splits the line into runs of one
//     direction and orders them visually, with the paragraph direction taken
//     from the first strong character (or the default the caller gives). The
//     forced modes skip it and treat the line as one run.
//  2. Fonts and scripts. Inside each run every code point gets a font: a mark,
//     variation selector or joiner stays with the font before it when that
//     font can take it; otherwise the first family (in the typeface's order)
//     that has the character supplies it, and inside the family the member
//     closest to the style asked for that has it (weight distance, plus the
//     distance of two weight classes for a slant mismatch). A character no
//     family has comes from the system's last-resort font for it
//     (SystemFallbackFont) when the typeface allows, else stays with the
//     previous font, or takes the first family's (its missing-glyph box).
//     An emoji sequence (a pictograph with its emoji variation selector, skin
//     tone, tags or keycap, pictographs joined by ZWJ, a pair of regional
//     indicators) is one unit: when it asks for emoji style (a selector,
//     modifier, join, flag or keycap does; a lone pictograph does when emoji
//     is its default presentation) the whole sequence takes the first colour
//     font that has its first character, from the families or else from the
//     system, so that the font's ligatures make one glyph of it. Otherwise
//     its characters are chosen one by one as above.
//     Common and inherited characters belong to the script around them. A
//     new segment starts wherever font or script change.
//  3. Shaping. Each segment is shaped by HarfBuzz in font units with the
//     whole context around it (so joining scripts join across font changes),
//     with the paint's font features and first locale; non-zero letter
//     spacing turns the standard ligatures off. Segments of a right-to-left
//     run are placed from the logically last to the first.
//  4. Placement. Glyphs go left to right from pen 0 on the baseline, scaled
//     from font units by size (and scaleX horizontally). Letter spacing puts
//     half a space before and after every cluster. The bounds are the union
//     of every glyph's ink box at its position.
//
// Fakery: a member lighter by 200 or more than a weight of 600 or above is
// emboldened; an upright member is slanted when italic is asked for.

#include <unicode/ubidi.h>
#include <unicode/uchar.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <deque>
#include <map>
#include <string>

#include "platform/LocaleList.h"
#include "platform/SystemFonts.h"
#include "platform/TextLayout.h"
#include "platform/Unicode.h"
#include "platform/linux/FontLinux.h"

namespace Glimmer::Platform {
namespace {

constexpr float kMaxTextSize = 16384.0f;
constexpr float kFakeItalicSkew = -0.25f;

struct DirectionalRun {
    size_t start;   // absolute index in the text
    size_t length;
    bool rtl;
};

struct FontChoice {
    int family = -1;
    int member = -1;
    bool operator==(const FontChoice& other) const {
        return family == other.family && member == other.member;
    }
    bool Valid() const { return family >= 0; }
};

struct Segment {
    size_t start;   // absolute index in the text
    size_t end;
    FontChoice font;
    uint32_t script;
};

bool IsDefaultIgnorableJoiner(uint32_t cp) {
    return cp == 0x200C || cp == 0x200D || (cp >= 0xFE00 && cp <= 0xFE0F) ||
           (cp >= 0xE0100 && cp <= 0xE01EF);
}

bool StaysWithPrevious(uint32_t cp) {
    if (IsDefaultIgnorableJoiner(cp)) return true;
    switch (hb_unicode_general_category(hb_unicode_funcs_get_default(), cp)) {
        case HB_UNICODE_GENERAL_CATEGORY_NON_SPACING_MARK:
        case HB_UNICODE_GENERAL_CATEGORY_SPACING_MARK:
        case HB_UNICODE_GENERAL_CATEGORY_ENCLOSING_MARK:
            return true;
        default:
            return false;
    }
}

// The code point at text[i] (i < end) and the units it takes; a surrogate
// that is not part of a pair inside [.., end) reads as U+FFFD.
uint32_t CodePointAt(const uint16_t* text, size_t i, size_t end, size_t* units) {
    uint32_t unit = text[i];
    *units = 1;
    if ((unit & 0xFC00) == 0xD800 && i + 1 < end && (text[i + 1] & 0xFC00) == 0xDC00) {
        *units = 2;
        return 0x10000 + ((unit - 0xD800) << 10) + (text[i + 1] - 0xDC00);
    }
    if ((unit & 0xF800) == 0xD800) return 0xFFFD;
    return unit;
}

bool IsRegionalIndicator(uint32_t cp) { return cp >= 0x1F1E6 && cp <= 0x1F1FF; }
bool IsEmojiModifier(uint32_t cp) { return cp >= 0x1F3FB && cp <= 0x1F3FF; }
bool IsTag(uint32_t cp) { return cp >= 0xE0020 && cp <= 0xE007F; }
constexpr uint32_t kZwj = 0x200D, kTextStyle = 0xFE0E, kEmojiStyle = 0xFE0F, kKeycap = 0x20E3;

bool IsPictographic(uint32_t cp) {
    // Every pictograph lies in these ranges; most text never reaches the lookup.
    if (!((cp >= 0x00A9 && cp <= 0x3299) || (cp >= 0x1F000 && cp <= 0x1FFFF))) return false;
    return u_hasBinaryProperty(UChar32(cp), UCHAR_EXTENDED_PICTOGRAPHIC) ||
           u_hasBinaryProperty(UChar32(cp), UCHAR_EMOJI);
}

// The emoji sequence starting at text[start] (start < end), if one does:
// sets *sequenceEnd past it and *emojiStyle to whether it asks for emoji
// presentation. A keycap base (digit, '#', '*') starts one only with a
// selector or keycap after it.
bool EmojiSequence(const uint16_t* text, size_t start, size_t end, size_t* sequenceEnd, bool* emojiStyle) {
    size_t units = 1;
    const uint32_t base = CodePointAt(text, start, end, &units);
    size_t at = start + units;
    auto peek = [&](size_t i, size_t* n) { return i < end ? CodePointAt(text, i, end, n) : 0u; };
    size_t n = 0;
    if (IsRegionalIndicator(base)) {
        *emojiStyle = true;
        if (IsRegionalIndicator(peek(at, &n))) at += n;   // a flag is a pair
        *sequenceEnd = at;
        return true;
    }
    if (!IsPictographic(base)) {
        const uint32_t next = peek(at, &n);
        const bool keycapBase = (base >= '0' && base <= '9') || base == '#' || base == '*';
        if (!(keycapBase && (next == kEmojiStyle || next == kKeycap))) return false;
    }
    bool emoji = u_hasBinaryProperty(UChar32(base), UCHAR_EMOJI_PRESENTATION);
    for (;;) {
        const uint32_t next = peek(at, &n);
        if (next == kEmojiStyle || next == kKeycap || IsEmojiModifier(next) || IsTag(next)) {
            emoji = true;
        } else if (next == kTextStyle) {
            emoji = false;
        } else if (next == kZwj) {
            size_t joined = 0;
            if (!IsPictographic(peek(at + n, &joined))) break;
            emoji = true;
            n += joined;
        } else {
            break;
        }
        at += n;
    }
    *sequenceEnd = at;
    *emojiStyle = emoji;
    return true;
}

// Picks fonts for code points from the typeface's families, and from the
// system's last-resort fonts, which it appends as families of its own.
class FontChooser {
public:
    explicit FontChooser(const Typeface& typeface) : typeface_(typeface) {}

    FontChoice Choose(uint32_t cp, FontChoice previous) {
        if (previous.Valid() && StaysWithPrevious(cp) &&
            (IsDefaultIgnorableJoiner(cp) || Member(previous).font->HasGlyph(cp))) {
            return previous;
        }
        for (size_t f = 0; f < FamilyCount(); ++f) {
            int member = BestMember(int(f), cp, true);
            if (member >= 0) return {int(f), member};
        }
        if (FontChoice fallback = SystemFont(cp, false); fallback.Valid()) return fallback;
        if (previous.Valid()) return previous;
        for (size_t f = 0; f < typeface_.families.size(); ++f) {
            int member = BestMember(int(f), cp, false);
            if (member >= 0) return {int(f), member};
        }
        return {};
    }

    // The first colour font that has `cp`: a family's, else the system's.
    FontChoice ChooseColor(uint32_t cp) {
        for (size_t f = 0; f < FamilyCount(); ++f) {
            const FontFamily* family = Family(f);
            if (family == nullptr) continue;
            for (size_t m = 0; m < family->fonts.size(); ++m) {
                const std::shared_ptr<Font>& font = family->fonts[m].font;
                if (font != nullptr && font->HasColorGlyphs() && font->HasGlyph(cp)) return {int(f), int(m)};
            }
        }
        return SystemFont(cp, true);
    }

    const FontFamily::Member& Member(FontChoice choice) const {
        return Family(size_t(choice.family))->fonts[size_t(choice.member)];
    }

    Fakery FakeryOf(FontChoice choice) const {
        const FontFamily::Member& member = Member(choice);
        Fakery fakery;
        fakery.bold = typeface_.weight >= 600 && typeface_.weight - member.weight >= 200;
        fakery.italic = typeface_.italic && !member.italic;
        return fakery;
    }

private:
    size_t FamilyCount() const { return typeface_.families.size() + system_.size(); }

    const FontFamily* Family(size_t f) const {
        const size_t own = typeface_.families.size();
        return f < own ? typeface_.families[f].get() : &system_[f - own];
    }

    // The system's font for `cp` as a family of its own (one per font).
    FontChoice SystemFont(uint32_t cp, bool color) {
        // Controls and format characters draw nothing: they stay where they are.
        if (!typeface_.systemFallback || IsDefaultIgnorableJoiner(cp)) return {};
        const auto category = hb_unicode_general_category(hb_unicode_funcs_get_default(), cp);
        if (category == HB_UNICODE_GENERAL_CATEGORY_CONTROL || category == HB_UNICODE_GENERAL_CATEGORY_FORMAT) {
            return {};
        }
        std::shared_ptr<Font> font = SystemFallbackFont(cp, color);
        if (font == nullptr) return {};
        const size_t own = typeface_.families.size();
        for (size_t i = 0; i < system_.size(); ++i) {
            if (system_[i].fonts[0].font == font) return {int(own + i), 0};
        }
        system_.emplace_back(0u, 0, std::vector<FontFamily::Member>{{std::move(font), 400, false}});
        return {int(own + system_.size() - 1), 0};
    }

    int BestMember(int family, uint32_t cp, bool mustHave) const {
        const FontFamily* f = Family(size_t(family));
        if (f == nullptr) return -1;
        int best = -1;
        int bestScore = 0;
        for (size_t m = 0; m < f->fonts.size(); ++m) {
            const FontFamily::Member& member = f->fonts[m];
            if (member.font == nullptr) continue;
            if (mustHave && !member.font->HasGlyph(cp)) continue;
            int score = std::abs(member.weight - typeface_.weight) +
                        (member.italic != typeface_.italic ? 200 : 0);
            if (best < 0 || score < bestScore) {
                best = int(m);
                bestScore = score;
            }
        }
        return best;
    }

    const Typeface& typeface_;
    std::deque<FontFamily> system_;   // stable addresses: runs keep pointers to their fonts only
};

std::vector<DirectionalRun> SplitDirections(Bidi bidi, const uint16_t* text, size_t start,
                                            size_t count) {
    bool forcedRtl = bidi == Bidi::kRtl || bidi == Bidi::kDefaultRtl || bidi == Bidi::kForceRtl;
    std::vector<DirectionalRun> runs;
    if (bidi == Bidi::kForceLtr || bidi == Bidi::kForceRtl) {
        runs.push_back({start, count, forcedRtl});
        return runs;
    }
    UBiDiLevel level = UBIDI_DEFAULT_LTR;
    switch (bidi) {
        case Bidi::kLtr: level = 0; break;
        case Bidi::kRtl: level = 1; break;
        case Bidi::kDefaultRtl: level = UBIDI_DEFAULT_RTL; break;
        default: level = UBIDI_DEFAULT_LTR; break;
    }
    std::u16string units(text + start, text + start + count);
    UErrorCode status = U_ZERO_ERROR;
    UBiDi* para = ubidi_openSized(int32_t(count), 0, &status);
    if (U_SUCCESS(status)) {
        ubidi_setPara(para, units.data(), int32_t(count), level, nullptr, &status);
    }
    int32_t runCount = U_SUCCESS(status) ? ubidi_countRuns(para, &status) : 0;
    if (U_SUCCESS(status)) {
        for (int32_t i = 0; i < runCount; ++i) {
            int32_t logicalStart = 0, length = 0;
            UBiDiDirection direction = ubidi_getVisualRun(para, i, &logicalStart, &length);
            if (length <= 0) continue;
            runs.push_back({start + size_t(logicalStart), size_t(length), direction == UBIDI_RTL});
        }
    }
    if (para != nullptr) ubidi_close(para);
    if (U_FAILURE(status) || runs.empty()) {
        runs.clear();
        runs.push_back({start, count, forcedRtl});
    }
    return runs;
}

// Font and script segments of one directional run, in logical order.
std::vector<Segment> SplitSegments(FontChooser& chooser, const uint16_t* text, const DirectionalRun& run,
                                   FontChoice* previous) {
    struct Unit {
        size_t start;
        size_t end;
        FontChoice font;
        uint32_t script;
    };
    std::vector<Unit> points;
    hb_unicode_funcs_t* unicode = hb_unicode_funcs_get_default();
    size_t end = run.start + run.length;
    for (size_t i = run.start; i < end;) {
        size_t units = 1;
        uint32_t cp = CodePointAt(text, i, end, &units);
        size_t sequenceEnd = 0;
        bool emojiStyle = false;
        if (EmojiSequence(text, i, end, &sequenceEnd, &emojiStyle) && emojiStyle) {
            if (FontChoice color = chooser.ChooseColor(cp); color.Valid()) {
                *previous = color;
                while (i < sequenceEnd) {
                    cp = CodePointAt(text, i, end, &units);
                    points.push_back({i, i + units, color, uint32_t(hb_unicode_script(unicode, cp))});
                    i += units;
                }
                continue;
            }
        }
        FontChoice font = chooser.Choose(cp, *previous);
        *previous = font;
        points.push_back({i, i + units, font, uint32_t(hb_unicode_script(unicode, cp))});
        i += units;
    }
    // Common and inherited characters take the script before them; leading
    // ones the first real script after them.
    uint32_t current = kScriptCommon;
    for (Unit& p : points) {
        if (p.script == kScriptCommon || p.script == kScriptInherited) {
            p.script = current;
        } else {
            current = p.script;
        }
    }
    uint32_t following = kScriptCommon;
    for (auto it = points.rbegin(); it != points.rend(); ++it) {
        if (it->script == kScriptCommon) {
            it->script = following;
        } else {
            following = it->script;
        }
    }
    std::vector<Segment> segments;
    for (const Unit& p : points) {
        if (!segments.empty() && segments.back().font == p.font &&
            segments.back().script == p.script) {
            segments.back().end = p.end;
        } else {
            segments.push_back({p.start, p.end, p.font, p.script});
        }
    }
    return segments;
}

std::vector<hb_feature_t> ParseFeatures(const Paint& paint) {
    std::vector<hb_feature_t> features;
    const std::string& settings = paint.fontFeatureSettings;
    size_t pos = 0;
    while (pos < settings.size()) {
        size_t comma = settings.find(',', pos);
        if (comma == std::string::npos) comma = settings.size();
        size_t first = settings.find_first_not_of(" \t", pos);
        if (first != std::string::npos && first < comma) {
            size_t last = settings.find_last_not_of(" \t", comma - 1);
            hb_feature_t feature;
            if (hb_feature_from_string(settings.data() + first, int(last - first + 1), &feature)) {
                features.push_back(feature);
            }
        }
        pos = comma + 1;
    }
    if (paint.letterSpacing != 0.0f) {
        for (const char* tag : {"liga", "clig"}) {
            features.push_back({hb_tag_from_string(tag, 4), 0, HB_FEATURE_GLOBAL_START,
                                HB_FEATURE_GLOBAL_END});
        }
    }
    return features;
}

hb_language_t LanguageOf(const Paint& paint) {
    std::vector<std::string> locales = GetLocaleList(paint.localeListId);
    if (locales.empty()) return HB_LANGUAGE_INVALID;
    return hb_language_from_string(locales.front().c_str(), -1);
}

bool Usable(const Paint& paint) {
    return std::isfinite(paint.size) && paint.size > 0.0f && paint.size <= kMaxTextSize &&
           std::isfinite(paint.scaleX) && std::isfinite(paint.skewX) &&
           std::isfinite(paint.letterSpacing);
}

void Unite(LayoutRect* bounds, const LayoutRect& box) {
    if (box.IsEmpty()) return;
    if (bounds->IsEmpty()) {
        *bounds = box;
        return;
    }
    bounds->left = std::min(bounds->left, box.left);
    bounds->top = std::min(bounds->top, box.top);
    bounds->right = std::max(bounds->right, box.right);
    bounds->bottom = std::max(bounds->bottom, box.bottom);
}

}  // namespace

RunFont ResolveRunFont(const Paint& paint, const FontRun& run) {
    RunFont font;
    font.font = run.font.get();
    font.size = paint.size;
    font.scaleX = paint.scaleX;
    font.skewX = paint.skewX + (run.fakery.italic ? kFakeItalicSkew : 0.0f);
    font.embolden = paint.embolden || run.fakery.bold;
    font.antiAlias = paint.antiAlias;
    font.subpixel = paint.subpixel;
    return font;
}

bool LayoutText(const Paint& paint, Bidi bidi, const Typeface& typeface, const uint16_t* text,
                size_t textLength, size_t start, size_t count, size_t contextStart,
                size_t contextCount, Layout* out, bool inkBounds) {
    if (out == nullptr) return false;
    *out = Layout();
    constexpr size_t kMaxUnits = size_t(INT32_MAX) / 4;
    if ((text == nullptr && textLength != 0) || textLength > kMaxUnits || start > textLength ||
        count > textLength - start || contextStart > start || contextCount > textLength - contextStart ||
        start + count > contextStart + contextCount) {
        return false;
    }
    if (count == 0 || !Usable(paint) || typeface.families.empty()) return true;

    FontChooser chooser(typeface);
    std::vector<hb_feature_t> features = ParseFeatures(paint);
    hb_language_t language = LanguageOf(paint);
    hb_buffer_t* buffer = hb_buffer_create();
    const float spacing = paint.letterSpacing * paint.size * paint.scaleX;

    float pen = 0.0f;
    bool anyCluster = false;
    FontChoice previous;
    for (const DirectionalRun& run : SplitDirections(bidi, text, start, count)) {
        std::vector<Segment> segments = SplitSegments(chooser, text, run, &previous);
        if (run.rtl) std::reverse(segments.begin(), segments.end());
        for (const Segment& segment : segments) {
            if (!segment.font.Valid()) continue;
            const FontFamily::Member& member = chooser.Member(segment.font);
            auto* font = static_cast<const FontLinux*>(member.font.get());
            Fakery fakery = chooser.FakeryOf(segment.font);

            hb_buffer_clear_contents(buffer);
            hb_buffer_add_utf16(buffer, text + contextStart, int(contextCount),
                                unsigned(segment.start - contextStart),
                                int(segment.end - segment.start));
            hb_buffer_set_direction(buffer, run.rtl ? HB_DIRECTION_RTL : HB_DIRECTION_LTR);
            hb_buffer_set_script(buffer, hb_script_t(segment.script));
            hb_buffer_set_language(buffer, language);
            hb_shape(font->HbFont(), buffer, features.data(), unsigned(features.size()));

            unsigned glyphCount = 0;
            const hb_glyph_info_t* infos = hb_buffer_get_glyph_infos(buffer, &glyphCount);
            const hb_glyph_position_t* positions = hb_buffer_get_glyph_positions(buffer, nullptr);
            if (glyphCount == 0) continue;

            if (out->runs.empty() || out->runs.back().font != member.font ||
                out->runs.back().fakery.bold != fakery.bold ||
                out->runs.back().fakery.italic != fakery.italic) {
                FontRun fontRun;
                fontRun.start = out->glyphs.size();
                fontRun.end = fontRun.start;
                fontRun.font = member.font;
                fontRun.fakery = fakery;
                out->runs.push_back(fontRun);
            }
            const float unitsToPixels = paint.size / float(font->UnitsPerEm());
            const float xScale = unitsToPixels * paint.scaleX;
            for (unsigned g = 0; g < glyphCount; ++g) {
                if (spacing != 0.0f && (g == 0 || infos[g].cluster != infos[g - 1].cluster)) {
                    pen += anyCluster ? spacing : spacing * 0.5f;
                }
                anyCluster = true;
                LayoutGlyph glyph;
                glyph.font = font;
                glyph.glyphId = infos[g].codepoint;
                glyph.x = pen + float(positions[g].x_offset) * xScale;
                glyph.y = -float(positions[g].y_offset) * unitsToPixels;
                out->glyphs.push_back(glyph);
                pen += float(positions[g].x_advance) * xScale;
            }
            out->runs.back().end = out->glyphs.size();
        }
    }
    hb_buffer_destroy(buffer);
    if (spacing != 0.0f && anyCluster) pen += spacing * 0.5f;
    out->advance = pen;
    if (!inkBounds) return true;

    // Ink bounds, each distinct glyph of a run measured once.
    for (const FontRun& run : out->runs) {
        RunFont runFont = ResolveRunFont(paint, run);
        std::map<uint32_t, LayoutRect> measured;
        for (size_t i = run.start; i < run.end; ++i) {
            const LayoutGlyph& glyph = out->glyphs[i];
            auto found = measured.find(glyph.glyphId);
            if (found == measured.end()) {
                found = measured.emplace(glyph.glyphId, GlyphBounds(runFont, glyph.glyphId)).first;
            }
            LayoutRect box = found->second;
            if (box.IsEmpty()) continue;
            box.left += glyph.x;
            box.right += glyph.x;
            box.top += glyph.y;
            box.bottom += glyph.y;
            Unite(&out->bounds, box);
        }
    }
    return true;
}

}  // namespace Glimmer::Platform
