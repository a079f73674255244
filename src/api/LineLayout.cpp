// Line layout, the way an Android TextView's Layout would make it.
//
// Breaking. The text splits into paragraphs at '\n'. Without a wrap width a
// paragraph is one line. With one, lines are filled greedily: the line grows
// to the furthest Unicode line-break opportunity (ICU's line iterator) whose
// visible part - the text without its trailing spaces - still fits; the
// spaces at a break stay on the line that ends there, as on Android. A word
// wider than the width on its own is cut between grapheme clusters, keeping
// at least one cluster per line. Widths are measured with the very shaping
// the glyph drawing uses, so a line that fits here fits when drawn.
//
// Vertical metrics. Every line is as tall as the font's ascent and descent
// (rounded to pixels); with font padding on, the first line reaches up to the
// font box's top and the last one down to its bottom (each floored or
// ceiled), which is what a TextView does by default. Baselines follow from
// the line tops: baseline = top - ascent. Metrics come from the text's own
// font; fallback fonts do not make lines taller.
//
// Records. The shown lines keep their distances from one another; the
// vertical gravity places the block they make in the view.

#include "api/LineLayout.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <memory>

#include "platform/TextBreaks.h"

namespace glimmer::detail {
namespace {

// The characters a line's visible end skips back over, as Android's layout does.
bool IsLineEndSpace(char16_t c) {
    return c == ' ' || c == '\t' || c == 0x1680 || (c >= 0x2000 && c <= 0x200A && c != 0x2007) ||
           c == 0x205F || c == 0x3000;
}

size_t VisibleEnd(const std::u16string& text, size_t start, size_t end) {
    while (end > start && IsLineEndSpace(text[end - 1])) --end;
    return end;
}

void BreakParagraph(const std::u16string& text, size_t start, size_t end, const MeasureFn& measure,
                    float wrapWidth, Glimmer::Platform::TextBreaker* lineBreaks,
                    Glimmer::Platform::TextBreaker* graphemes,
                    std::vector<LayoutLine>* out) {
    auto emit = [&](size_t from, size_t to, float width) {
        LayoutLine line;
        line.start = int(from);
        line.end = int(to);
        line.visibleEnd = int(VisibleEnd(text, from, to));
        line.width = width;
        out->push_back(line);
    };
    if (!(wrapWidth > 0.0f) || start == end) {
        const size_t visible = VisibleEnd(text, start, end);
        emit(start, end, visible > start ? measure(start, visible) : 0.0f);
        return;
    }

    const std::vector<size_t> opportunities = lineBreaks->Boundaries(text.data(), start, end);
    size_t lineStart = start;
    size_t next = 0;   // the first opportunity not yet known to fit
    while (lineStart < end) {
        size_t fit = lineStart;
        float fitWidth = 0.0f;
        for (; next < opportunities.size(); ++next) {
            const size_t at = opportunities[next];
            if (at <= lineStart) continue;
            const size_t visible = VisibleEnd(text, lineStart, at);
            const float width = visible > lineStart ? measure(lineStart, visible) : 0.0f;
            if (width > wrapWidth) break;
            fit = at;
            fitWidth = width;
        }
        if (next == opportunities.size()) {
            emit(lineStart, end, fitWidth);
            return;
        }
        if (fit > lineStart) {
            emit(lineStart, fit, fitWidth);
            lineStart = fit;
            continue;
        }
        // One word alone is too wide: cut it between clusters.
        const size_t wordEnd = opportunities[next];
        const std::vector<size_t> clusters = graphemes->Boundaries(text.data(), lineStart, wordEnd);
        size_t cut = clusters.front();
        auto visibleWidth = [&](size_t to) {
            const size_t visible = VisibleEnd(text, lineStart, to);
            return visible > lineStart ? measure(lineStart, visible) : 0.0f;
        };
        float cutWidth = visibleWidth(cut);
        for (size_t i = 1; i < clusters.size(); ++i) {
            const float width = visibleWidth(clusters[i]);
            if (width > wrapWidth) break;
            cut = clusters[i];
            cutWidth = width;
        }
        emit(lineStart, cut, cutWidth);
        lineStart = cut;
    }
}

int Clamp(int64_t value) { return int(std::clamp<int64_t>(value, INT_MIN, INT_MAX)); }

int TruncateToInt(float value) {
    if (!(value > float(INT_MIN) && value < float(INT_MAX))) return 0;
    return int(value);
}

}  // namespace

std::vector<LayoutLine> BreakLines(const std::u16string& text, const MeasureFn& measure, float wrapWidth) {
    using Glimmer::Platform::TextBreaker;
    std::unique_ptr<TextBreaker> lineBreaks, graphemes;
    if (wrapWidth > 0.0f) {
        lineBreaks = std::make_unique<TextBreaker>(TextBreaker::Kind::kLine);
        graphemes = std::make_unique<TextBreaker>(TextBreaker::Kind::kGrapheme);
    }
    std::vector<LayoutLine> lines;
    size_t start = 0;
    for (;;) {
        const size_t newline = text.find(u'\n', start);
        const size_t end = newline == std::u16string::npos ? text.size() : newline;
        const size_t before = lines.size();
        BreakParagraph(text, start, end, measure, wrapWidth, lineBreaks.get(), graphemes.get(), &lines);
        if (newline == std::u16string::npos) break;
        // The break belongs to the paragraph's last line.
        if (lines.size() > before) lines.back().end = int(newline + 1);
        start = newline + 1;
    }
    return lines;
}

void PlaceLines(std::vector<LayoutLine>* lines, const FontExtent& extent, bool includePad, int layoutWidth,
                Align align) {
    int64_t top = 0;
    for (size_t i = 0; i < lines->size(); ++i) {
        LayoutLine& line = (*lines)[i];
        const int above = includePad && i == 0 ? extent.top : extent.ascent;
        const int below = includePad && i + 1 == lines->size() ? extent.bottom : extent.descent;
        line.top = Clamp(top);
        line.ascent = above;
        line.descent = below;
        line.baseline = Clamp(top - above);
        top += int64_t(below) - above;
        line.bottom = Clamp(top);
        switch (align) {
            case Align::kLeft:
                line.left = 0.0f;
                break;
            case Align::kCenter:
                line.left = std::floor((float(layoutWidth) - line.width) / 2.0f);
                break;
            case Align::kRight:
                line.left = float(layoutWidth) - line.width;
                break;
        }
    }
}

std::vector<Glimmer::GxLineInfo> MakeLineRecords(const std::vector<LayoutLine>& lines, const ViewGeometry& view) {
    std::vector<Glimmer::GxLineInfo> records;
    if (view.first < 0 || view.count <= 0 || size_t(view.first) >= lines.size()) return records;
    const size_t first = size_t(view.first);
    const size_t last = std::min(lines.size(), first + size_t(view.count)) - 1;

    // The first shown baseline, from the top of the block of shown lines.
    const int64_t blockHeight = int64_t(lines[last].bottom) - lines[first].top;
    int64_t y = int64_t(lines[first].baseline) - lines[first].top;
    switch (view.gravity) {
        case Gravity::kTop:
            y += view.padding.top;
            break;
        case Gravity::kCenter: {
            const int64_t available = int64_t(view.height) - view.padding.top - view.padding.bottom;
            y += view.padding.top;
            if (available > blockHeight) y += (available - blockHeight) / 2;
            break;
        }
        case Gravity::kBottom:
            y += int64_t(view.height) - view.padding.bottom - blockHeight;
            break;
    }

    for (size_t i = first; i <= last; ++i) {
        const LayoutLine& line = lines[i];
        const int64_t baseline = y + line.baseline - lines[first].baseline;
        Glimmer::GxLineInfo record;
        record.x = Clamp(int64_t(view.padding.left) + TruncateToInt(line.left));
        record.baseline = Clamp(baseline);
        record.start = line.start;
        record.end = line.visibleEnd;
        record.direction = 1;
        record.bounds.left = record.x;
        record.bounds.top = Clamp(baseline + line.ascent);
        record.bounds.right = Clamp(int64_t(record.x) + TruncateToInt(line.width));
        record.bounds.bottom = Clamp(baseline + line.descent);
        records.push_back(record);
    }
    return records;
}

}  // namespace glimmer::detail
