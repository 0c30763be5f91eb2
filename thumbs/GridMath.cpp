#include "thumbs/GridMath.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstdlib>

namespace grid {

int LabelHeight(int tmHeight, int cyEdge) {
    return tmHeight + 2 + cyEdge;
}

int ColumnsForWidth(int clientWidth, int cellWidth, int gap) {
    const int pitch = cellWidth + gap;
    if (pitch <= 0)
        return 1;
    return std::max(1, (clientWidth + gap) / pitch);
}

int RowsForCount(int count, int columns) {
    if (count <= 0 || columns <= 0)
        return 0;
    return static_cast<int>(std::ceil(static_cast<double>(count) / static_cast<double>(columns)));
}

int CapTotalHeight(long long totalHeight, int rowPitch) {
    if (totalHeight <= kScrollCap)
        return static_cast<int>(totalHeight);
    if (rowPitch <= 0)
        return kScrollCap;
    return kScrollCap - kScrollCap % rowPitch;
}

LayoutNumbers ComputeLayout(const Geometry& g, int count, int columns, int clientHeight) {
    LayoutNumbers n;
    const int rowPitch = g.RowPitch();
    const int columnPitch = g.ColumnPitch();
    n.lineX = columnPitch;
    n.lineY = rowPitch;
    n.rows = count > 0 ? RowsForCount(count, columns) : 0;
    n.visibleRows = rowPitch > 0 ? clientHeight / rowPitch : 0;
    n.remainder = rowPitch > 0 ? clientHeight % rowPitch : clientHeight;
    n.totalWidth = columns * columnPitch + g.originX - g.gap;
    // A million drawings in one column of large pictures pass the int range: add up in 64 bits, then cap.
    n.totalHeight = CapTotalHeight(static_cast<long long>(g.originY) +
                                       static_cast<long long>(rowPitch) * n.rows + n.remainder,
                                   rowPitch);
    if (count <= 0) {
        n.visibleRows = 0;
        n.poolRows = 0;
        n.poolSize = 0;
        return n;
    }
    if (n.visibleRows > n.rows)
        n.visibleRows = n.rows;
    n.poolRows = n.visibleRows + 2;
    n.poolSize = columns * n.poolRows;
    return n;
}

int PoolSlot(int index, int poolSize) {
    return poolSize > 0 ? index % poolSize : 0;
}

Cell CellOf(const Geometry& g, int columns, int poolSize, int row, int column, int rowTop) {
    Cell c;
    c.index = columns * row + column;
    c.slot = PoolSlot(c.index, poolSize);
    c.left = g.originX + column * g.ColumnPitch();
    c.top = rowTop;
    c.right = c.left + g.cellWidth;
    c.bottom = c.top + g.cellHeight;
    return c;
}

namespace {
// Rounds a non-negative value half up.
int RoundHalfUp(double v) {
    return static_cast<int>(std::floor(v + 0.5));
}
} // namespace

namespace {
int Grown(int side) {
    return RoundHalfUp(side * 1.25);
}
int Shrunk(int side) {
    return RoundHalfUp(side / 1.25);
}
} // namespace

long long LiveThumbnailsFor(const Geometry& g, int clientWidth, int clientHeight) {
    const int rowPitch = std::max(1, g.RowPitch());
    const long long columns = ColumnsForWidth(clientWidth, g.cellWidth, g.gap);
    const long long rows = std::max(0, clientHeight) / rowPitch;
    return columns * (rows + 2);
}

PictureSize SmallestPicture() {
    static const PictureSize smallest = [] {
        Geometry g; // default size, no label: the most rows a font could give
        g.labelHeight = 0;
        for (;;) {
            Geometry next = g;
            next.cellHeight = Shrunk(g.cellHeight);
            next.cellWidth = Shrunk(g.cellWidth);
            if (g.cellHeight < kMinCellSize || g.cellWidth < kMinCellSize ||
                LiveThumbnailsFor(next, kReferenceScreenWidth, kReferenceScreenHeight) > kMaxLiveThumbnails)
                break;
            g = next;
        }
        PictureSize size;
        size.width = g.cellWidth;
        size.height = g.cellHeight;
        return size;
    }();
    return smallest;
}

PictureSize LargestPicture(int maxClientHeight) {
    PictureSize size;
    // No screen is a million pixels high; the bound keeps the steps far from overflowing.
    maxClientHeight = std::min(maxClientHeight, 1 << 20);
    // A client lower than the default picture still keeps the default.
    while (Grown(size.height) < maxClientHeight) {
        size.height = Grown(size.height);
        size.width = Grown(size.width);
    }
    return size;
}

PictureSize ClampPicture(int width, int height, int maxClientHeight) {
    const PictureSize smallest = SmallestPicture();
    const PictureSize largest = LargestPicture(maxClientHeight);
    PictureSize size;
    size.width = std::clamp(width, smallest.width, std::max(smallest.width, largest.width));
    size.height = std::clamp(height, smallest.height, std::max(smallest.height, largest.height));
    return size;
}

bool IncreaseCell(int& cellHeight, int& cellWidth, int clientHeight) {
    const int height = Grown(cellHeight);
    const int width = Grown(cellWidth);
    if (height >= clientHeight)
        return false;
    cellHeight = height;
    cellWidth = width;
    return true;
}

bool DecreaseCell(int& cellHeight, int& cellWidth) {
    const PictureSize smallest = SmallestPicture();
    const int height = Shrunk(cellHeight);
    const int width = Shrunk(cellWidth);
    if (height < smallest.height || width < smallest.width)
        return false;
    cellHeight = height;
    cellWidth = width;
    return true;
}

bool GrowToLiveLimit(int& cellHeight, int& cellWidth, int labelHeight, int gap, int clientWidth,
                     int clientHeight) {
    Geometry g;
    g.cellHeight = cellHeight;
    g.cellWidth = cellWidth;
    g.labelHeight = labelHeight;
    g.gap = gap;
    bool grown = false;
    // Each step is a quarter larger: a few dozen steps outgrow any client.
    for (int step = 0; step < 64 && LiveThumbnailsFor(g, clientWidth, clientHeight) > kMaxLiveThumbnails;
         ++step) {
        g.cellHeight = std::max(Grown(g.cellHeight), g.cellHeight + 1);
        g.cellWidth = std::max(Grown(g.cellWidth), g.cellWidth + 1);
        grown = true;
    }
    cellHeight = g.cellHeight;
    cellWidth = g.cellWidth;
    return grown;
}

RefitNumbers ComputeRefit(const Geometry& g, int clientRight, int clientBottom, int frameWidth,
                          int frameHeight, int roomRight, int roomBottom) {
    RefitNumbers r;
    const int rowPitch = g.RowPitch();
    const int columnPitch = g.ColumnPitch();
    const int height = clientBottom - g.originY;
    r.remainder = rowPitch > 0 ? height % rowPitch : 0;
    // To the nearest whole column: the frame grows when more than half a column is left over, and
    // shrinks otherwise; it grows only as far as the room it has.
    const long long width = static_cast<long long>(g.gap) - g.originX + clientRight;
    int columns = 1;
    if (columnPitch > 0) {
        const long long nearest = std::max<long long>(1, (width + columnPitch / 2) / columnPitch);
        const long long whole = std::max<long long>(1, width / columnPitch);
        const long long grow = nearest * columnPitch - width;
        columns =
            static_cast<int>(std::min<long long>(grow <= roomRight ? nearest : whole, INT_MAX / columnPitch));
    }
    r.columns = columns;
    r.neededWidth = columnPitch * r.columns - g.gap + g.originX;
    r.frameWidth = frameWidth + (r.neededWidth - clientRight);
    // Rows the same way; a client too low for one whole row grows to one when it has the room, or keeps
    // its height.
    r.frameHeight = frameHeight;
    if (rowPitch > 0 && height >= 0) {
        const long long nearest =
            std::max<long long>(1, (static_cast<long long>(height) + rowPitch / 2) / rowPitch);
        const long long whole = height / rowPitch;
        const long long grow = nearest * rowPitch - height;
        const long long rows = grow <= roomBottom ? nearest : whole;
        if (rows > 0)
            r.frameHeight = static_cast<int>(frameHeight + (rows * rowPitch - height));
    }
    return r;
}

int RelayoutFirstRow(int oldColumns, int firstRow, int newColumns, int count) {
    if (newColumns <= 0)
        return 0;
    const long long row = static_cast<long long>(oldColumns) * firstRow / newColumns;
    return static_cast<int>(std::min<long long>(row, count));
}

int BarMaxPos(int totalHeight, int clientHeight) {
    return std::max(0, totalHeight - clientHeight);
}

int BarPosOfRow(int firstRow, int lastFirstRow, int maxPos) {
    if (lastFirstRow <= 0 || maxPos <= 0)
        return 0;
    const long long row = std::clamp(firstRow, 0, lastFirstRow);
    // Rounded to the nearest position, in 64 bits: 2^28 rows times a 32768-pixel range passes int.
    return static_cast<int>((row * maxPos + lastFirstRow / 2) / lastFirstRow);
}

int RowOfBarPos(int pos, int lastFirstRow, int maxPos) {
    if (lastFirstRow <= 0 || maxPos <= 0)
        return 0;
    const long long p = std::clamp(pos, 0, maxPos);
    return static_cast<int>((p * lastFirstRow + maxPos / 2) / maxPos);
}

int PageUpFirstRow(int firstRow, int visibleRows) {
    const int row = firstRow - visibleRows;
    // Less than one page from the top: go to the top.
    return row < visibleRows ? 0 : row;
}

int PageDownFirstRow(int firstRow, int visibleRows, int rows) {
    int row = firstRow + visibleRows;
    if (row + visibleRows > rows)
        row = rows - visibleRows;
    return std::max(0, row);
}

int EndFirstRow(int rows, int visibleRows) {
    // A client lower than one row still shows one, partly: the last row, not the empty space after it.
    return std::max(0, rows - std::max(1, visibleRows));
}

namespace {
void PlaceBar(ScrollState& s) {
    s.y =
        BarPosOfRow(s.firstRow, EndFirstRow(s.rows, s.visibleRows), BarMaxPos(s.totalHeight, s.clientHeight));
}
} // namespace

LineStep LineUp(ScrollState& s, const Geometry& g) {
    LineStep step;
    const int rowPitch = g.RowPitch();
    if (s.x > 0 && s.firstRow > 0) {
        s.x = 0;
        step.resetX = true;
    }
    if (s.firstRow == 0)
        return step;
    s.firstRow -= 1;
    step.moved = true;
    step.createRow = s.firstRow;
    step.createRowTop = g.originY - rowPitch;
    PlaceBar(s);
    return step;
}

LineStep LineDown(ScrollState& s, const Geometry& g) {
    LineStep step;
    const int rowPitch = g.RowPitch();
    // The last row stays in view, also in a client lower than one row.
    if (s.firstRow + std::max(1, s.visibleRows) >= s.rows)
        return step;
    if (s.x > 0) {
        s.x = 0;
        step.resetX = true;
    }
    const int row = s.firstRow + 1 + s.visibleRows;
    if (row < s.rows) {
        step.createRow = row;
        step.createRowTop = rowPitch * (s.visibleRows + 1) + g.originY;
    }
    s.firstRow += 1;
    step.moved = true;
    PlaceBar(s);
    return step;
}

} // namespace grid
