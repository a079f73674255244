// Line breaking, placing and the line records, on hand-made measures and
// metrics.

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
    // First line from the box top, middle lines ascent to descent, last to the box bottom.
    EXPECT_EQ(lines[0].top, 0);
    EXPECT_EQ(lines[0].baseline, 12);
    EXPECT_EQ(lines[0].bottom, 15);
    EXPECT_EQ(lines[1].baseline, 25);
    EXPECT_EQ(lines[1].bottom, 28);
    EXPECT_EQ(lines[2].baseline, 38);
    EXPECT_EQ(lines[2].bottom, 43);
    EXPECT_EQ(lines[2].descent, 5);
    EXPECT_EQ(lines[0].ascent, -12);
    EXPECT_EQ(lines[0].left, 12.0f);    // floor((45 - 20) / 2)
    EXPECT_EQ(lines[1].left, 2.0f);     // floor(2.5)

    PlaceLines(&lines, extent, false, 45, Align::kRight);
    EXPECT_EQ(lines[0].baseline, 10);
    EXPECT_EQ(lines[2].bottom, 39);
    EXPECT_EQ(lines[1].left, 5.0f);
}

// Five lines 20 pixels apart, baselines at 15, 35, ...
std::vector<LayoutLine> FiveLines() {
    std::vector<LayoutLine> lines(5);
    for (int i = 0; i < 5; ++i) {
        lines[i].start = i * 3;
        lines[i].visibleEnd = i * 3 + 2;
        lines[i].top = 20 * i;
        lines[i].baseline = 20 * i + 15;
        lines[i].bottom = 20 * i + 20;
        lines[i].ascent = -15;
        lines[i].descent = 5;
        lines[i].left = 2.7f;
        lines[i].width = 30.9f;
    }
    return lines;
}

TEST(LineRecordsTest, GravityPlacesTheBlockOfShownLines) {
    ViewGeometry view;
    view.width = 100;
    view.height = 200;
    view.padding = {4, 10, 0, 7};
    view.first = 3;
    view.count = 5;   // only two are left from line 3

    view.gravity = Gravity::kBottom;
    std::vector<Glimmer::GxLineInfo> records = MakeLineRecords(FiveLines(), view);
    ASSERT_EQ(records.size(), 2u);
    EXPECT_EQ(records[0].start, 9);     // lines 3 and 4
    EXPECT_EQ(records[1].end, 14);      // the visible end
    // The last line's box ends on the bottom padding: 200 - 7 - descent 5.
    EXPECT_EQ(records[1].baseline, 188);
    EXPECT_EQ(records[0].baseline, 168);
    EXPECT_EQ(records[1].x, 4 + 2);     // padding + truncated left
    EXPECT_EQ(records[1].direction, 1);
    EXPECT_EQ(records[1].bounds.left, 6);
    EXPECT_EQ(records[1].bounds.right, 6 + 30);
    EXPECT_EQ(records[1].bounds.top, 188 - 15);
    EXPECT_EQ(records[1].bounds.bottom, 188 + 5);

    view.gravity = Gravity::kTop;   // the first shown line's top on the top padding
    records = MakeLineRecords(FiveLines(), view);
    EXPECT_EQ(records[0].baseline, 10 + 15);

    view.gravity = Gravity::kCenter;   // 183 available, a block of 40: 71 down
    records = MakeLineRecords(FiveLines(), view);
    EXPECT_EQ(records[0].baseline, 10 + 71 + 15);

    view.height = 20;   // taller than the view: from the top padding
    records = MakeLineRecords(FiveLines(), view);
    EXPECT_EQ(records[0].baseline, 10 + 15);

    view.first = 5;   // nothing past the last line
    EXPECT_TRUE(MakeLineRecords(FiveLines(), view).empty());
}

}  // namespace
}  // namespace glimmer::detail
