// Line breaking and placing on hand-made measures and metrics. Where the
// records put the shown lines in the view is pinned by the picture table.

#include <gtest/gtest.h>

#include <array>
#include <vector>

#include "api/LineLayout.h"

namespace glimmer::detail {
namespace {

// Every UTF-16 unit 10 pixels wide.
float TenEach(size_t start, size_t end) { return 10.0f * float(end - start); }

// Each line as (start, end, visible end, width).
using Lines = std::vector<std::array<float, 4>>;

Lines Broken(const std::u16string& text, float width) {
    Lines out;
    for (const LayoutLine& l : BreakLines(text, TenEach, width)) {
        out.push_back({float(l.start), float(l.end), float(l.visibleEnd), l.width});
    }
    return out;
}

TEST(LineBreakingTest, WrapsAtOpportunitiesCutsTooWideWordsAndSplitsAtNewlines) {
    const struct {
        const char16_t* text;
        float width;
        Lines lines;
    } cases[] = {
        // Trailing spaces stay on the line but are not visible, nor measured.
        {u"aaa bbb ccc", 65.0f, {{0, 4, 3, 30}, {4, 8, 7, 30}, {8, 11, 11, 30}}},
        {u"aaa bbb ccc", 70.0f, {{0, 8, 7, 70}, {8, 11, 11, 30}}},
        {u"well-known", 60.0f, {{0, 5, 5, 50}, {5, 10, 10, 50}}},   // a hyphen is an opportunity
        {u"abcdefg", 30.0f, {{0, 3, 3, 30}, {3, 6, 6, 30}, {6, 7, 7, 10}}},
        {u"ae\u0301bc", 20.0f, {{0, 1, 1, 10}, {1, 3, 3, 20}, {3, 5, 5, 20}}},   // e + acute is one cluster
        // "ab", "", "cd", and the empty line after the final break.
        {u"ab\n\ncd\n", 0.0f, {{0, 3, 2, 20}, {3, 4, 3, 0}, {4, 7, 6, 20}, {7, 7, 7, 0}}},
    };
    for (const auto& c : cases) EXPECT_EQ(Broken(c.text, c.width), c.lines) << "width " << c.width;
}

TEST(LinePlacingTest, FontPaddingAndAlignment) {
    std::vector<LayoutLine> lines = BreakLines(u"aa\nbbbb\ncc", TenEach, 0.0f);
    const FontExtent extent{-12, -10, 3, 5};
    PlaceLines(&lines, extent, true, 45, Align::kCenter);
    // Each line as (top, baseline, bottom, left): the first from the box top,
    // middle lines ascent to descent, the last to the box bottom; centred
    // lines start at floor((45 - width) / 2).
    auto placed = [&] {
        std::vector<std::array<float, 4>> out;
        for (const LayoutLine& l : lines) out.push_back({float(l.top), float(l.baseline), float(l.bottom), l.left});
        return out;
    };
    EXPECT_EQ(placed(), (std::vector<std::array<float, 4>>{{0, 12, 15, 12}, {15, 25, 28, 2}, {28, 38, 43, 12}}));
    PlaceLines(&lines, extent, false, 45, Align::kRight);
    EXPECT_EQ(placed(), (std::vector<std::array<float, 4>>{{0, 10, 13, 25}, {13, 23, 26, 5}, {26, 36, 39, 25}}));
}

}  // namespace
}  // namespace glimmer::detail
