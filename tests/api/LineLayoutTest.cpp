// Line breaking, placing and the line records, on hand-made measures and
// metrics.

#include <gtest/gtest.h>

#include "api/LineLayout.h"

namespace glimmer::detail {
namespace {

// Every UTF-16 unit 10 pixels wide.
float TenEach(size_t start, size_t end) { return 10.0f * float(end - start); }

TEST(LineBreakingTest, WrapsAtBreakOpportunitiesKeepingSpacesOnTheLine) {
    const std::vector<LayoutLine> lines = BreakLines(u"aaa bbb ccc", TenEach, 65.0f);
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0].start, 0);
    EXPECT_EQ(lines[0].end, 4);          // the space stays on the first line
    EXPECT_EQ(lines[0].visibleEnd, 3);   // but is not visible
    EXPECT_EQ(lines[0].width, 30.0f);
    EXPECT_EQ(lines[1].start, 4);
    EXPECT_EQ(lines[2].start, 8);
    EXPECT_EQ(lines[2].visibleEnd, 11);

    // Two words fit in 70 (the trailing space does not count).
    const std::vector<LayoutLine> two = BreakLines(u"aaa bbb ccc", TenEach, 70.0f);
    ASSERT_EQ(two.size(), 2u);
    EXPECT_EQ(two[0].visibleEnd, 7);
    EXPECT_EQ(two[0].width, 70.0f);

    // A hyphen is an opportunity; a split on spaces would miss it.
    const std::vector<LayoutLine> hyphen = BreakLines(u"well-known", TenEach, 60.0f);
    ASSERT_EQ(hyphen.size(), 2u);
    EXPECT_EQ(hyphen[0].visibleEnd, 5);
}

TEST(LineBreakingTest, CutsAWordTooWideBetweenClustersAndSplitsAtNewlines) {
    const std::vector<LayoutLine> cut = BreakLines(u"abcdefg", TenEach, 30.0f);
    ASSERT_EQ(cut.size(), 3u);
    EXPECT_EQ(cut[0].visibleEnd, 3);
    EXPECT_EQ(cut[1].start, 3);
    EXPECT_EQ(cut[2].visibleEnd, 7);

    // e + combining acute is one cluster: never cut between them.
    const std::vector<LayoutLine> cluster = BreakLines(u"ae\u0301bc", TenEach, 20.0f);
    ASSERT_GE(cluster.size(), 2u);
    EXPECT_NE(cluster[0].visibleEnd, 2);

    const std::vector<LayoutLine> paragraphs = BreakLines(u"ab\n\ncd\n", TenEach, 0.0f);
    ASSERT_EQ(paragraphs.size(), 4u);   // "ab", "", "cd", and the empty line after the final break
    EXPECT_EQ(paragraphs[0].end, 3);
    EXPECT_EQ(paragraphs[0].visibleEnd, 2);
    EXPECT_EQ(paragraphs[1].start, 3);
    EXPECT_EQ(paragraphs[1].visibleEnd, 3);
    EXPECT_EQ(paragraphs[2].width, 20.0f);
    EXPECT_EQ(paragraphs[3].start, 7);
    EXPECT_EQ(paragraphs[3].visibleEnd, 7);
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
