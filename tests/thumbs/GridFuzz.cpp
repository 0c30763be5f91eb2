// Fuzzes the thumbnail grid's arithmetic with extreme sizes and counts, in the order the grid view uses
// it: a picture size from the settings file brought into range, grown for a huge client, the layout of
// any number of drawings, then a run of size changes, resizes and scroll steps. Under the sanitizers no
// step may overflow; after every step the first row shown holds drawings of the list, the scroll
// position stays inside the capped range and the ring of controls stays within what a process can spare.
#include "thumbs/GridMath.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>

namespace {

void Check(bool ok) {
    if (!ok)
        std::abort();
}

// More drawings than a process could hold records for (a record is a few hundred bytes, the process a
// few gigabytes); the grid's indices are ints, so a list near INT_MAX is not a case to meet.
constexpr int kMostDrawings = 1 << 28;

struct View {
    grid::Geometry g;
    int count = 0;
    int clientWidth = 0;
    int clientHeight = 0;
    int columns = 1;
    grid::LayoutNumbers n;
    grid::ScrollState s;
};

void CheckLayout(const View& v) {
    const grid::LayoutNumbers& n = v.n;
    Check(v.columns >= 1);
    Check(n.rows >= 0 && n.visibleRows >= 0 && n.visibleRows <= std::max(n.rows, 0));
    if (v.count > 0) {
        // Every drawing has a cell, and no row is empty.
        Check(static_cast<long long>(n.rows) * v.columns >= v.count);
        Check(static_cast<long long>(n.rows - 1) * v.columns < v.count);
        Check(n.poolRows == n.visibleRows + 2 && n.poolSize == v.columns * n.poolRows);
    } else {
        Check(n.rows == 0 && n.poolSize == 0);
    }
    Check(n.totalHeight >= 0 && n.totalHeight <= grid::kScrollCap);
    Check(n.lineY == v.g.RowPitch() && n.lineX == v.g.ColumnPitch());
}

// The first row shown and the scroll position after any step.
void CheckScroll(const View& v) {
    const grid::ScrollState& s = v.s;
    Check(s.firstRow >= 0);
    if (v.count > 0)
        Check(static_cast<long long>(s.firstRow) * v.columns < v.count); // the first index shown is a drawing
    Check(s.y >= 0 && s.y <= std::max(0, s.totalHeight));
}

// The view hands a relayout's position to the scroll bar, which keeps it inside its range.
int SetScrollPos(const View& v, int y) {
    Check(y >= 0 && y <= std::max(0, v.s.totalHeight) + v.g.originY);
    return std::clamp(y, 0, std::max(0, v.s.totalHeight));
}

int BarPos(const View& v) {
    return grid::BarPosOfRow(v.s.firstRow, grid::EndFirstRow(v.s.rows, v.s.visibleRows),
                             grid::BarMaxPos(v.s.totalHeight, v.s.clientHeight));
}

void Lay(View& v) {
    v.columns = grid::ColumnsForWidth(v.clientWidth, v.g.cellWidth, v.g.gap);
    v.n = grid::ComputeLayout(v.g, v.count, v.columns, v.clientHeight);
    CheckLayout(v);
    v.s.rows = v.n.rows;
    v.s.visibleRows = v.n.visibleRows;
    v.s.totalHeight = v.n.totalHeight;
    v.s.clientHeight = v.clientHeight;
    v.s.firstRow = std::min(v.s.firstRow, grid::EndFirstRow(v.n.rows, v.n.visibleRows));
    v.s.y = std::clamp(v.s.y, 0, std::max(0, v.n.totalHeight));
}

void CheckCreatedRow(const View& v, const grid::LineStep& step) {
    Check(step.createRow >= -1 && step.createRow < std::max(v.n.rows, 0));
    if (step.createRow < 0 || v.n.poolSize == 0)
        return;
    for (int column = 0; column < v.columns; column += std::max(1, v.columns - 1)) {
        const grid::Cell c =
            grid::CellOf(v.g, v.columns, v.n.poolSize, step.createRow, column, step.createRowTop);
        Check(c.slot >= 0 && c.slot < v.n.poolSize);
        Check(c.index == step.createRow * v.columns + column);
        Check(c.right - c.left == v.g.cellWidth && c.bottom - c.top == v.g.cellHeight);
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzedDataProvider in(data, size);
    View v;
    // The screen's height as the system gives it (up to the largest window side), a stored picture size
    // that may be anything at all.
    const int screenHeight = in.ConsumeIntegralInRange(0, 32767);
    const grid::PictureSize smallest = grid::SmallestPicture();
    const grid::PictureSize largest = grid::LargestPicture(screenHeight);
    grid::PictureSize picture =
        grid::ClampPicture(in.ConsumeIntegral<int>(), in.ConsumeIntegral<int>(), screenHeight);
    Check(picture.width >= smallest.width && picture.height >= smallest.height);
    Check(picture.width <= std::max(smallest.width, largest.width) &&
          picture.height <= std::max(smallest.height, largest.height));
    v.g.cellWidth = picture.width;
    v.g.cellHeight = picture.height;
    v.g.labelHeight = grid::LabelHeight(in.ConsumeIntegralInRange(0, 512), in.ConsumeIntegralInRange(0, 16));
    v.g.gap = in.ConsumeIntegralInRange(0, 64);
    v.g.originX = in.ConsumeIntegralInRange(0, 64);
    v.g.originY = in.ConsumeIntegralInRange(0, 64);
    // Window sizes as the system reports them (a window is at most 32767 pixels a side), any count.
    v.clientWidth = in.ConsumeIntegralInRange(0, 32767);
    v.clientHeight = in.ConsumeIntegralInRange(0, 32767);
    v.count = in.ConsumeIntegralInRange(0, kMostDrawings);

    // A client larger than the reference screen grows the cells until the ring fits.
    grid::GrowToLiveLimit(v.g.cellHeight, v.g.cellWidth, v.g.labelHeight, v.g.gap, v.clientWidth,
                          v.clientHeight);
    Check(grid::LiveThumbnailsFor(v.g, v.clientWidth, v.clientHeight) <= grid::kMaxLiveThumbnails ||
          v.g.cellHeight > v.clientHeight);
    Lay(v);
    if (v.count > 0)
        Check(v.n.poolSize <=
              std::max<long long>(grid::kMaxLiveThumbnails,
                                  grid::LiveThumbnailsFor(v.g, v.clientWidth, v.clientHeight)));
    CheckScroll(v);

    for (int op = 0; op < 256 && in.remaining_bytes() > 0; ++op) {
        switch (in.ConsumeIntegralInRange(0, 8)) {
        case 0: {
            const grid::LineStep step = grid::LineDown(v.s, v.g);
            CheckCreatedRow(v, step);
            break;
        }
        case 1: {
            const grid::LineStep step = grid::LineUp(v.s, v.g);
            CheckCreatedRow(v, step);
            break;
        }
        case 2:
            v.s.firstRow = grid::PageDownFirstRow(v.s.firstRow, v.s.visibleRows, v.s.rows);
            break;
        case 3:
            v.s.firstRow = grid::PageUpFirstRow(v.s.firstRow, v.s.visibleRows);
            break;
        case 4:
            v.s.firstRow = grid::EndFirstRow(v.s.rows, v.s.visibleRows);
            v.s.y = SetScrollPos(v, BarPos(v));
            break;
        case 5: { // Increase or Decrease, then a new layout
            if (in.ConsumeBool())
                grid::IncreaseCell(v.g.cellHeight, v.g.cellWidth, v.clientHeight);
            else
                grid::DecreaseCell(v.g.cellHeight, v.g.cellWidth);
            Lay(v);
            break;
        }
        case 6: { // the window is resized: the first drawing shown stays in view
            const int oldColumns = v.columns;
            v.clientWidth = in.ConsumeIntegralInRange(0, 32767);
            v.clientHeight = in.ConsumeIntegralInRange(0, 32767);
            grid::GrowToLiveLimit(v.g.cellHeight, v.g.cellWidth, v.g.labelHeight, v.g.gap, v.clientWidth,
                                  v.clientHeight);
            const int newColumns = grid::ColumnsForWidth(v.clientWidth, v.g.cellWidth, v.g.gap);
            v.s.firstRow = grid::RelayoutFirstRow(oldColumns, v.s.firstRow, newColumns, v.count);
            Lay(v);
            v.s.y = SetScrollPos(v, BarPos(v));
            const grid::RefitNumbers r = grid::ComputeRefit(v.g, v.clientWidth, v.clientHeight,
                                                            v.clientWidth + 16, v.clientHeight + 40);
            Check(r.columns >= 1);
            break;
        }
        case 7: { // the thumb is dragged
            const int maxPos = grid::BarMaxPos(v.s.totalHeight, v.s.clientHeight);
            const int track = in.ConsumeIntegralInRange(0, maxPos);
            const int last = grid::EndFirstRow(v.s.rows, v.s.visibleRows);
            v.s.firstRow = grid::RowOfBarPos(track, last, maxPos);
            Check(v.s.firstRow >= 0 && v.s.firstRow <= last);
            v.s.y = SetScrollPos(v, BarPos(v));
            break;
        }
        case 8: // the list is read again with another count
            v.count = in.ConsumeIntegralInRange(0, kMostDrawings);
            Lay(v);
            break;
        }
        CheckScroll(v);
    }
    return 0;
}
