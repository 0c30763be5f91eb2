#include "thumbs/GridMath.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>

namespace {

using namespace grid;

Geometry DefaultGeometry(int labelHeight = 20) {
    Geometry g;
    g.labelHeight = labelHeight;
    return g;
}

TEST(GridMath, LabelHeight) {
    EXPECT_EQ(LabelHeight(16, 2), 20);
}

TEST(GridMath, ColumnsFromClientWidth) {
    EXPECT_EQ(ColumnsForWidth(700, 173, 5), 3); // 705 / 178
    EXPECT_EQ(ColumnsForWidth(706, 173, 5), 3);
    EXPECT_EQ(ColumnsForWidth(707, 173, 5), 4); // 712 / 178 = 4: the last column needs no gap
    EXPECT_EQ(ColumnsForWidth(10, 173, 5), 1);  // at least one
    EXPECT_EQ(ColumnsForWidth(0, 173, 5), 1);
}

TEST(GridMath, RowsRoundUp) {
    EXPECT_EQ(RowsForCount(10, 3), 4);
    EXPECT_EQ(RowsForCount(9, 3), 3);
    EXPECT_EQ(RowsForCount(1, 60), 1);
    EXPECT_EQ(RowsForCount(0, 3), 0);
}

TEST(GridMath, TenDrawingsInThreeColumnsLeaveOneInLastRow) {
    const Geometry g = DefaultGeometry();
    const LayoutNumbers n = ComputeLayout(g, 10, 3, 1000);
    EXPECT_EQ(n.rows, 4);
    // The last row holds index 9 only.
    int inLastRow = 0;
    for (int c = 0; c < 3; ++c)
        if (CellOf(g, 3, n.poolSize, 3, c, 0).index < 10)
            ++inLastRow;
    EXPECT_EQ(inLastRow, 1);
}

TEST(GridMath, LayoutScrollSizesAndPool) {
    const Geometry g = DefaultGeometry(); // row pitch 163, column pitch 178
    const LayoutNumbers n = ComputeLayout(g, 30, 3, 500);
    EXPECT_EQ(n.rows, 10);
    EXPECT_EQ(n.visibleRows, 3);
    EXPECT_EQ(n.remainder, 500 - 3 * 163);
    EXPECT_EQ(n.totalWidth, 3 * 178 - 5);
    EXPECT_EQ(n.totalHeight, 163 * 10 + 11);
    EXPECT_EQ(n.lineX, 178);
    EXPECT_EQ(n.lineY, 163);
    EXPECT_EQ(n.poolRows, 5);
    EXPECT_EQ(n.poolSize, 15);
}

TEST(GridMath, VisibleRowsNeverExceedRows) {
    const LayoutNumbers n = ComputeLayout(DefaultGeometry(), 4, 3, 1000);
    EXPECT_EQ(n.rows, 2);
    EXPECT_EQ(n.visibleRows, 2);
    EXPECT_EQ(n.poolRows, 4);
}

TEST(GridMath, EmptyListHasNoRowsAndNoPool) {
    const LayoutNumbers n = ComputeLayout(DefaultGeometry(), 0, 3, 500);
    EXPECT_EQ(n.rows, 0);
    EXPECT_EQ(n.visibleRows, 0);
    EXPECT_EQ(n.poolRows, 0);
    EXPECT_EQ(n.poolSize, 0);
    EXPECT_EQ(n.totalHeight, 500 % 163);
}

TEST(GridMath, TotalHeightIsCapped) {
    EXPECT_EQ(CapTotalHeight(32768, 163), 32768);
    EXPECT_EQ(CapTotalHeight(32769, 163), 32768 - 32768 % 163);
    EXPECT_EQ(CapTotalHeight(1000000, 163), 32763);
    const LayoutNumbers n = ComputeLayout(DefaultGeometry(), 3000, 3, 500);
    EXPECT_EQ(n.rows, 1000);
    EXPECT_EQ(n.totalHeight, 32763);
    EXPECT_EQ(n.totalHeight % 163, 0);
}

TEST(GridMath, TotalHeightBeyondTheIntRangeIsCapped) {
    // Two million drawings in one column of 2000-pixel rows: 4 * 10^9 pixels before the cap.
    Geometry g = DefaultGeometry();
    g.cellHeight = 1980;
    g.labelHeight = 20;
    const LayoutNumbers n = ComputeLayout(g, 2000000, 1, 1000);
    EXPECT_EQ(n.rows, 2000000);
    EXPECT_EQ(n.totalHeight, 32768 - 32768 % 2000);
    EXPECT_EQ(CapTotalHeight(5000000000LL, 2000), 32000);
    EXPECT_EQ(CapTotalHeight(5000000000LL, 0), 32768);
}

TEST(GridMath, PoolSlotIsIndexModPoolSize) {
    EXPECT_EQ(PoolSlot(0, 15), 0);
    EXPECT_EQ(PoolSlot(14, 15), 14);
    EXPECT_EQ(PoolSlot(15, 15), 0);
    EXPECT_EQ(PoolSlot(47, 15), 2);
}

TEST(GridMath, CellRectangles) {
    Geometry g = DefaultGeometry();
    g.originX = 2;
    const Cell c = CellOf(g, 3, 15, 4, 2, 163);
    EXPECT_EQ(c.index, 14);
    EXPECT_EQ(c.slot, 14);
    EXPECT_EQ(c.left, 2 + 2 * 178);
    EXPECT_EQ(c.right, c.left + 173);
    EXPECT_EQ(c.top, 163);
    EXPECT_EQ(c.bottom, 163 + 143);
}

TEST(GridMath, IncreaseRoundsHalfUp) {
    int h = 143, w = 173;
    EXPECT_TRUE(IncreaseCell(h, w, 1000));
    EXPECT_EQ(h, 179);
    EXPECT_EQ(w, 216);
}

TEST(GridMath, IncreaseRefusedUnlessNewHeightBelowClient) {
    int h = 143, w = 173;
    EXPECT_FALSE(IncreaseCell(h, w, 179)); // 179 is not less than 179
    EXPECT_EQ(h, 143);
    EXPECT_EQ(w, 173);
    EXPECT_TRUE(IncreaseCell(h, w, 180));
    EXPECT_EQ(h, 179);
}

TEST(GridMath, SmallestPictureKeepsTheLargestScreenWithinTheLiveLimit) {
    // From 143 x 173: 114 x 138, 91 x 110, 73 x 88, 58 x 70; the next, 46 x 56, would put 63 columns of
    // 48 rows on a 3840 x 2160 client.
    const PictureSize smallest = SmallestPicture();
    EXPECT_EQ(smallest.height, 58);
    EXPECT_EQ(smallest.width, 70);
    for (int label = 0; label <= 40; ++label) {
        Geometry g = DefaultGeometry(label);
        g.cellHeight = smallest.height;
        g.cellWidth = smallest.width;
        EXPECT_LE(LiveThumbnailsFor(g, kReferenceScreenWidth, kReferenceScreenHeight), kMaxLiveThumbnails)
            << label;
    }
    Geometry below = DefaultGeometry(0);
    below.cellHeight = 46;
    below.cellWidth = 56;
    EXPECT_GT(LiveThumbnailsFor(below, kReferenceScreenWidth, kReferenceScreenHeight), kMaxLiveThumbnails);
}

TEST(GridMath, LiveThumbnailsAreWholeColumnsTimesRowsPlusTwo) {
    Geometry g = DefaultGeometry(20); // pitches 178 x 163
    EXPECT_EQ(LiveThumbnailsFor(g, 700, 600), 3 * (3 + 2));
    EXPECT_EQ(LiveThumbnailsFor(g, 10, 10), 1 * (0 + 2));
    EXPECT_EQ(LiveThumbnailsFor(g, -5, -5), 1 * (0 + 2));
}

TEST(GridMath, DecreaseStopsAtTheSmallestPicture) {
    int h = 143, w = 173;
    int steps = 0;
    while (DecreaseCell(h, w))
        ++steps;
    EXPECT_EQ(steps, 4);
    EXPECT_EQ(h, 58);
    EXPECT_EQ(w, 70);
    EXPECT_FALSE(DecreaseCell(h, w));
    EXPECT_EQ(h, 58);
    EXPECT_EQ(w, 70);
    // Either side reaching below the smallest refuses the step.
    int h2 = 500, w2 = 80;
    EXPECT_FALSE(DecreaseCell(h2, w2));
    EXPECT_EQ(h2, 500);
}

TEST(GridMath, DecreaseRoundsHalfUp) {
    int h = 179, w = 216;
    EXPECT_TRUE(DecreaseCell(h, w));
    EXPECT_EQ(h, 143); // 143.2
    EXPECT_EQ(w, 173); // 172.8
    int h2 = 91, w2 = 110;
    EXPECT_TRUE(DecreaseCell(h2, w2));
    EXPECT_EQ(h2, 73); // 72.8
    EXPECT_EQ(w2, 88);
}

TEST(GridMath, LargestPictureIsTheLastIncreaseBelowTheClientHeight) {
    const PictureSize on2160 = LargestPicture(2160);
    EXPECT_EQ(on2160.height, 2091);
    EXPECT_EQ(on2160.width, 2523);
    const PictureSize on1000 = LargestPicture(1000);
    EXPECT_EQ(on1000.height, 856);
    EXPECT_EQ(on1000.width, 1033);
    // Each is reached by Increase on a client that tall.
    int h = 143, w = 173;
    while (IncreaseCell(h, w, 1000)) {
    }
    EXPECT_EQ(h, on1000.height);
    EXPECT_EQ(w, on1000.width);
    const PictureSize tiny = LargestPicture(100);
    EXPECT_EQ(tiny.height, kDefaultCellHeight);
    const PictureSize absurd = LargestPicture(2147483647);
    EXPECT_GT(absurd.height, 100000);
}

TEST(GridMath, StoredPictureSizesAreClampedToWhatTheCommandsReach) {
    const PictureSize kept = ClampPicture(200, 150, 1000);
    EXPECT_EQ(kept.width, 200);
    EXPECT_EQ(kept.height, 150);
    const PictureSize tiny = ClampPicture(1, 1, 1000);
    EXPECT_EQ(tiny.width, 70);
    EXPECT_EQ(tiny.height, 58);
    const PictureSize negative = ClampPicture(-500, -2147483647 - 1, 1000);
    EXPECT_EQ(negative.width, 70);
    EXPECT_EQ(negative.height, 58);
    const PictureSize huge = ClampPicture(2147483647, 100000, 1000);
    EXPECT_EQ(huge.width, 1033);
    EXPECT_EQ(huge.height, 856);
    const PictureSize mixed = ClampPicture(10, 5000, 1000);
    EXPECT_EQ(mixed.width, 70);
    EXPECT_EQ(mixed.height, 856);
    // Whatever was stored, a 3840 x 2160 client keeps within the limit.
    for (const PictureSize& size : {tiny, negative, mixed}) {
        Geometry g = DefaultGeometry(0);
        g.cellWidth = size.width;
        g.cellHeight = size.height;
        EXPECT_LE(LiveThumbnailsFor(g, kReferenceScreenWidth, kReferenceScreenHeight), kMaxLiveThumbnails);
    }
}

TEST(GridMath, AClientBeyondTheLargestScreenGrowsTheCells) {
    int h = 58, w = 70;
    EXPECT_FALSE(GrowToLiveLimit(h, w, 20, 5, kReferenceScreenWidth, kReferenceScreenHeight));
    EXPECT_EQ(h, 58);
    // Two 4K screens side by side and stacked.
    EXPECT_TRUE(GrowToLiveLimit(h, w, 20, 5, 2 * kReferenceScreenWidth, 2 * kReferenceScreenHeight));
    Geometry g = DefaultGeometry(20);
    g.cellHeight = h;
    g.cellWidth = w;
    EXPECT_LE(LiveThumbnailsFor(g, 2 * kReferenceScreenWidth, 2 * kReferenceScreenHeight),
              kMaxLiveThumbnails);
    EXPECT_GT(h, 58);
    // Even a client of 32767 x 32767 and cells of one pixel end within the limit.
    int h2 = 1, w2 = 1;
    EXPECT_TRUE(GrowToLiveLimit(h2, w2, 0, 0, 32767, 32767));
    g = DefaultGeometry(0);
    g.gap = 0;
    g.cellHeight = h2;
    g.cellWidth = w2;
    EXPECT_LE(LiveThumbnailsFor(g, 32767, 32767), kMaxLiveThumbnails);
}

TEST(GridMath, RefitToTheNearestWholeColumnsAndRows) {
    const Geometry g = DefaultGeometry(); // row pitch 163, column pitch 178
    // 700 + 5 is 3.96 columns: the frame grows to 4; 500 is 3.07 rows: it shrinks to 3.
    RefitNumbers r = ComputeRefit(g, 700, 500, 1000, 800);
    EXPECT_EQ(r.columns, 4);
    EXPECT_EQ(r.neededWidth, 4 * 178 - 5);
    EXPECT_EQ(r.remainder, 500 % 163);
    EXPECT_EQ(r.frameWidth, 1000 + (707 - 700));
    EXPECT_EQ(r.frameHeight, 800 - 11);
    // 600 + 5 is 3.4 columns: it shrinks to 3; 470 is 2.88 rows: it grows to 3.
    r = ComputeRefit(g, 600, 470, 1000, 800);
    EXPECT_EQ(r.columns, 3);
    EXPECT_EQ(r.frameWidth, 1000 + (529 - 600));
    EXPECT_EQ(r.frameHeight, 800 + (489 - 470));
}

TEST(GridMath, RefitGrowsOnlyAsFarAsTheRoomAllows) {
    const Geometry g = DefaultGeometry();
    const RefitNumbers r = ComputeRefit(g, 700, 470, 1000, 800, 6, 18);
    EXPECT_EQ(r.columns, 3) << "7 pixels more do not fit: whole columns";
    EXPECT_EQ(r.frameWidth, 1000 + (529 - 700));
    EXPECT_EQ(r.frameHeight, 800 - 144) << "19 pixels more do not fit: whole rows";
    const RefitNumbers roomy = ComputeRefit(g, 700, 470, 1000, 800, 7, 19);
    EXPECT_EQ(roomy.columns, 4);
    EXPECT_EQ(roomy.frameHeight, 800 + 19);
}

TEST(GridMath, RefitOfAClientTooLowForOneRow) {
    // It grows to one whole row when it has the room, else keeps its height.
    RefitNumbers r = ComputeRefit(DefaultGeometry(), 100, 100, 400, 300);
    EXPECT_EQ(r.columns, 1);
    EXPECT_EQ(r.remainder, 100);
    EXPECT_EQ(r.frameHeight, 300 + 63);
    EXPECT_EQ(r.frameWidth, 400 + 173 - 100);
    r = ComputeRefit(DefaultGeometry(), 100, 100, 400, 300, 0, 0);
    EXPECT_EQ(r.columns, 1);
    EXPECT_EQ(r.frameHeight, 300);
}

TEST(GridMath, RelayoutKeepsFirstDrawingInView) {
    EXPECT_EQ(RelayoutFirstRow(3, 10, 5, 100), 6); // drawing 30 is in row 6 of 5 columns
    EXPECT_EQ(RelayoutFirstRow(5, 6, 3, 100), 10);
    EXPECT_EQ(RelayoutFirstRow(60, 100, 1, 50), 50); // never beyond the count
}

TEST(GridMath, BarPositionIsTheFirstRowInProportion) {
    // 100 rows, 10 visible: first rows 0..90 over positions 0..900.
    EXPECT_EQ(BarPosOfRow(0, 90, 900), 0);
    EXPECT_EQ(BarPosOfRow(45, 90, 900), 450);
    EXPECT_EQ(BarPosOfRow(90, 90, 900), 900);
    EXPECT_EQ(BarPosOfRow(200, 90, 900), 900); // beyond the last page: at the bottom
    EXPECT_EQ(BarPosOfRow(-3, 90, 900), 0);
    EXPECT_EQ(BarPosOfRow(5, 0, 900), 0); // everything fits: no range
    EXPECT_EQ(BarPosOfRow(5, 90, 0), 0);
    EXPECT_EQ(BarMaxPos(32763, 500), 32263);
    EXPECT_EQ(BarMaxPos(400, 500), 0);
}

TEST(GridMath, BarPositionOfAFolderBeyondTheCappedRange) {
    // 200,000 rows of 30 pixels in a 32,768-pixel range: the middle row is in the middle of the bar, the
    // last page at its bottom; no step overflows.
    const int last = 200000 - 20;
    const int maxPos = 32760 - 600;
    EXPECT_EQ(BarPosOfRow(last / 2, last, maxPos), maxPos / 2);
    EXPECT_EQ(BarPosOfRow(last, last, maxPos), maxPos);
    EXPECT_EQ(RowOfBarPos(maxPos / 2, last, maxPos), last / 2);
    EXPECT_EQ(RowOfBarPos(maxPos, last, maxPos), last);
    EXPECT_EQ(RowOfBarPos(0, last, maxPos), 0);
    // A quarter of a billion rows.
    EXPECT_EQ(RowOfBarPos(maxPos, 1 << 28, maxPos), 1 << 28);
    EXPECT_EQ(BarPosOfRow(1 << 27, 1 << 28, maxPos), maxPos / 2);
}

TEST(GridMath, ThumbDroppedAnywhereStaysThere) {
    // Whether one position stands for many rows or one row for many positions, the row a dropped thumb
    // stands for puts the thumb back where it was dropped (within one row's share of the bar).
    struct Case {
        int last, maxPos;
    };
    for (const Case c :
         {Case{199980, 32160}, Case{90, 14590}, Case{997, 32263}, Case{1, 50}, Case{32160, 32160}}) {
        for (int pos = 0; pos <= c.maxPos; pos += std::max(1, c.maxPos / 997)) {
            const int row = RowOfBarPos(pos, c.last, c.maxPos);
            ASSERT_GE(row, 0);
            ASSERT_LE(row, c.last);
            const int back = BarPosOfRow(row, c.last, c.maxPos);
            const int share = c.maxPos / c.last + 1;
            ASSERT_LE(std::abs(back - pos), share) << pos << " of " << c.maxPos << " rows " << c.last;
            if (c.last >= c.maxPos) {
                ASSERT_EQ(back, pos);
            }
        }
    }
}

TEST(GridMath, PageUpJumpsToTopWithinOnePage) {
    EXPECT_EQ(PageUpFirstRow(15, 10), 0);
    EXPECT_EQ(PageUpFirstRow(20, 10), 10);
    EXPECT_EQ(PageUpFirstRow(25, 10), 15);
    EXPECT_EQ(PageUpFirstRow(3, 10), 0);
}

TEST(GridMath, PageDownStopsAtLastPage) {
    EXPECT_EQ(PageDownFirstRow(0, 10, 100), 10);
    EXPECT_EQ(PageDownFirstRow(85, 10, 100), 90);
    EXPECT_EQ(PageDownFirstRow(90, 10, 100), 90);
    EXPECT_EQ(PageDownFirstRow(0, 4, 4), 0);
}

TEST(GridMath, EndShowsLastPage) {
    EXPECT_EQ(EndFirstRow(100, 10), 90);
    EXPECT_EQ(EndFirstRow(4, 4), 0);
}

ScrollState StateFor(const Geometry& g, int count, int columns, int clientHeight) {
    const LayoutNumbers n = ComputeLayout(g, count, columns, clientHeight);
    ScrollState s;
    s.rows = n.rows;
    s.visibleRows = n.visibleRows;
    s.totalHeight = n.totalHeight;
    s.clientHeight = clientHeight;
    return s;
}

TEST(GridMath, LineDownCreatesNextRowAndStopsAtLastRow) {
    const Geometry g = DefaultGeometry();
    ScrollState s = StateFor(g, 30, 3, 500); // 10 rows, 3 visible
    LineStep step = LineDown(s, g);
    EXPECT_TRUE(step.moved);
    EXPECT_EQ(s.firstRow, 1);
    EXPECT_EQ(step.createRow, 4);
    EXPECT_EQ(step.createRowTop, 163 * 4);
    EXPECT_EQ(s.y, 163);
    for (int i = 0; i < 20; ++i)
        LineDown(s, g);
    EXPECT_EQ(s.firstRow, 7);
    step = LineDown(s, g);
    EXPECT_FALSE(step.moved);
    EXPECT_EQ(s.firstRow, 7);
}

TEST(GridMath, ClientLowerThanOneRowStopsAtTheLastRow) {
    const Geometry g = DefaultGeometry();
    ScrollState s = StateFor(g, 9, 3, 100); // 3 rows, none whole in 100 pixels
    ASSERT_EQ(s.visibleRows, 0);
    for (int i = 0; i < 5; ++i)
        LineDown(s, g);
    EXPECT_EQ(s.firstRow, 2); // the last row, never the empty space after it
    EXPECT_FALSE(LineDown(s, g).moved);
    EXPECT_EQ(EndFirstRow(3, 0), 2);
    EXPECT_EQ(EndFirstRow(0, 0), 0);
}

TEST(GridMath, LineUpAtTopDoesNothingAndResetsNothing) {
    const Geometry g = DefaultGeometry();
    ScrollState s = StateFor(g, 30, 3, 500);
    s.x = 40;
    const LineStep step = LineUp(s, g);
    EXPECT_FALSE(step.moved);
    EXPECT_FALSE(step.resetX); // y is 0
    EXPECT_EQ(s.x, 40);
}

TEST(GridMath, LineStepsResetHorizontalPosition) {
    const Geometry g = DefaultGeometry();
    ScrollState s = StateFor(g, 30, 3, 500);
    s.x = 40;
    EXPECT_TRUE(LineDown(s, g).resetX);
    EXPECT_EQ(s.x, 0);
    s.x = 40;
    const LineStep up = LineUp(s, g);
    EXPECT_TRUE(up.resetX);
    EXPECT_TRUE(up.moved);
    EXPECT_EQ(up.createRow, 0);
    EXPECT_EQ(up.createRowTop, -163);
    EXPECT_EQ(s.firstRow, 0);
    EXPECT_EQ(s.y, 0);
}

TEST(GridMath, HugeFolderReachesLastRowThroughCappedRange) {
    const Geometry g = DefaultGeometry();      // row pitch 163
    ScrollState s = StateFor(g, 3000, 3, 500); // 1000 rows, 163000 pixels > 32768
    ASSERT_EQ(s.totalHeight, 32763);
    const int limit = s.totalHeight - s.clientHeight;
    int steps = 0;
    int lastY = 0;
    while (true) {
        const int before = s.firstRow;
        const LineStep step = LineDown(s, g);
        if (!step.moved)
            break;
        ++steps;
        ASSERT_EQ(s.firstRow, before + 1);
        // The thumb only ever goes down on the way down, and stays within the range.
        ASSERT_GE(s.y, lastY);
        ASSERT_LE(s.y, limit);
        lastY = s.y;
        // Each created row exists and lies just below the visible band.
        if (step.createRow >= 0) {
            ASSERT_LT(step.createRow, s.rows);
            ASSERT_EQ(step.createRowTop, 163 * (s.visibleRows + 1));
        }
        ASSERT_LT(steps, 2000);
    }
    EXPECT_EQ(s.firstRow + s.visibleRows, s.rows);
    EXPECT_EQ(s.firstRow, 997);
    EXPECT_EQ(s.y, limit); // the last page: the thumb at the bottom

    // And back up to the first row, the thumb going up with it.
    while (s.firstRow > 0) {
        const LineStep step = LineUp(s, g);
        ASSERT_TRUE(step.moved);
        ASSERT_LE(s.y, lastY);
        lastY = s.y;
    }
    EXPECT_EQ(s.firstRow, 0);
    EXPECT_EQ(s.y, 0);
    EXPECT_FALSE(LineUp(s, g).moved);
}

TEST(GridMath, LineStepsPutTheThumbWhereTheRowIs) {
    const Geometry g = DefaultGeometry();
    ScrollState s = StateFor(g, 3000, 3, 500);
    s.firstRow = 498;
    LineDown(s, g);
    EXPECT_EQ(s.firstRow, 499);
    EXPECT_EQ(s.y, BarPosOfRow(499, 997, 32763 - 500));
    EXPECT_NEAR(s.y, (32763 - 500) / 2, 20);
    LineUp(s, g);
    EXPECT_EQ(s.y, BarPosOfRow(498, 997, 32763 - 500));
}

} // namespace
