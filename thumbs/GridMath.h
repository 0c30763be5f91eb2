// The arithmetic of the thumbnail grid: columns, rows, scroll sizes under the 32768-pixel cap, the
// ring of controls, cell size steps, refitting, and the row-by-row scrolling rules. Portable: no
// <windows.h>. The grid view feeds it client sizes and scroll positions and acts on the answers.
#pragma once

#include <climits>

namespace grid {

// Scroll ranges are kept below this many pixels.
constexpr int kScrollCap = 32768;
// Cell sizes below this cannot be made smaller.
constexpr int kMinCellSize = 20;
// The most thumbnails the grid keeps alive at once: each is three windows (picture, label, tooltip), and a
// process has 10,000 window handles to share with the host it lives in.
constexpr int kMaxLiveThumbnails = 2000;
// The largest screen the smallest picture size is made for.
constexpr int kReferenceScreenWidth = 3840;
constexpr int kReferenceScreenHeight = 2160;
// Default geometry of the view.
constexpr int kDefaultCellHeight = 143;
constexpr int kDefaultCellWidth = 173;
constexpr int kDefaultGap = 5;
constexpr int kDefaultPoolRows = 11;

// Height of the label under a picture: the font's text height, 2 pixels, and one edge.
int LabelHeight(int tmHeight, int cyEdge);

// Cell geometry of the grid.
struct Geometry {
    int originX = 0;
    int originY = 0;
    int cellWidth = kDefaultCellWidth;
    int cellHeight = kDefaultCellHeight;
    int gap = kDefaultGap; // between columns only
    int labelHeight = 0;

    int ColumnPitch() const { return cellWidth + gap; }
    int RowPitch() const { return cellHeight + labelHeight; }
};

// Whole columns that fit the client width, at least 1.
int ColumnsForWidth(int clientWidth, int cellWidth, int gap);
// Rows needed for count drawings, the last one possibly partly filled.
int RowsForCount(int count, int columns);
// A total height above the cap becomes the largest multiple of the row pitch within it (the cap itself
// for a pitch that is not positive). The total may be beyond the int range.
int CapTotalHeight(long long totalHeight, int rowPitch);

// Everything a layout computes before it creates controls.
struct LayoutNumbers {
    int rows = 0;
    int visibleRows = 0; // whole rows in the client height, at most rows
    int remainder = 0;   // client height left below the whole rows
    int totalWidth = 0;  // scroll sizes
    int totalHeight = 0; // already capped
    int lineX = 0;       // line and page steps
    int lineY = 0;
    int poolRows = 0; // visible rows + 2, 0 for an empty list
    int poolSize = 0; // controls in the ring
};

LayoutNumbers ComputeLayout(const Geometry& g, int count, int columns, int clientHeight);

// Ring slot of list index i.
int PoolSlot(int index, int poolSize);

// One cell of a row being created: the list index, its ring slot and its rectangle.
struct Cell {
    int index = 0;
    int slot = 0;
    int left = 0, top = 0, right = 0, bottom = 0;
};
// Cell of column c in list row r whose top edge is at rowTop.
Cell CellOf(const Geometry& g, int columns, int poolSize, int row, int column, int rowTop);

// A picture size (the cell without its label).
struct PictureSize {
    int width = kDefaultCellWidth;
    int height = kDefaultCellHeight;
};

// Thumbnails alive in a client area of this size however many drawings there are: whole columns times
// (whole rows + 2).
long long LiveThumbnailsFor(const Geometry& g, int clientWidth, int clientHeight);

// The smallest picture: the last size Decrease reaches from the default before a 3840 x 2160 client would
// hold more than kMaxLiveThumbnails (counted without labels, so it holds for any font).
PictureSize SmallestPicture();
// The largest picture: the last size Increase reaches from the default while its height stays below
// maxClientHeight (the tallest client the screen allows).
PictureSize LargestPicture(int maxClientHeight);
// A stored picture size brought within what Decrease and Increase can reach: each side between the
// smallest and the largest picture's. Negative and huge values included.
PictureSize ClampPicture(int width, int height, int maxClientHeight);

// Cell size steps. Both change height and width together and return false when refused.
// Increase: x1.25 rounded half up, only when the new height stays below the client height.
bool IncreaseCell(int& cellHeight, int& cellWidth, int clientHeight);
// Decrease: /1.25 rounded half up, refused when either side would fall below the smallest picture's.
bool DecreaseCell(int& cellHeight, int& cellWidth);
// For a client larger than the reference screen: grows the cell by Increase's steps until the client holds
// at most kMaxLiveThumbnails. Returns true when it changed the size.
bool GrowToLiveLimit(int& cellHeight, int& cellWidth, int labelHeight, int gap, int clientWidth,
                     int clientHeight);

// Numbers of a refit to the client rectangle.
struct RefitNumbers {
    int remainder = 0;   // client height below the last whole row
    int columns = 1;     // whole columns the refit client holds
    int neededWidth = 0; // client width that holds exactly those columns
    int frameWidth = 0;  // frame size that makes the client hold whole columns and rows
    int frameHeight = 0;
};
// roomRight, roomBottom: how far the frame may grow (to the edge of the screen's work area).
RefitNumbers ComputeRefit(const Geometry& g, int clientRight, int clientBottom, int frameWidth,
                          int frameHeight, int roomRight = INT_MAX, int roomBottom = INT_MAX);

// First row after a change of columns, keeping the first drawing shown in view.
int RelayoutFirstRow(int oldColumns, int firstRow, int newColumns, int count);
// The vertical scroll bar shows where the first row lies between the top and the last page, in
// proportion: the bar's pixel range is capped, a folder's rows are not, so one position may stand for
// many rows. maxPos is the bar's largest position (its range less its page).
int BarMaxPos(int totalHeight, int clientHeight);
// The bar's position for a first row of 0..lastFirstRow.
int BarPosOfRow(int firstRow, int lastFirstRow, int maxPos);
// The first row a bar position stands for (a thumb dropped there): the row whose position is nearest.
int RowOfBarPos(int pos, int lastFirstRow, int maxPos);

// Keyboard jumps.
int PageUpFirstRow(int firstRow, int visibleRows);
int PageDownFirstRow(int firstRow, int visibleRows, int rows);
// The last first row: the last page, or the last row when not one row fits the client.
int EndFirstRow(int rows, int visibleRows);

// The row-by-row scrolling state of the view.
struct ScrollState {
    int firstRow = 0;
    int visibleRows = 0;
    int rows = 0;
    int x = 0; // scroll position
    int y = 0;
    int totalHeight = 0;  // capped
    int clientHeight = 0; // the bar's page
};

// What one line step asks the view to do.
struct LineStep {
    bool moved = false;   // first row changed (a row was created and the contents scrolled)
    bool resetX = false;  // horizontal position set back to 0
    int createRow = -1;   // list row to create, -1 when it does not exist
    int createRowTop = 0; // its top in client coordinates
};

// One row up / one row down; y becomes the bar's position of the new first row.
LineStep LineUp(ScrollState& s, const Geometry& g);
LineStep LineDown(ScrollState& s, const Geometry& g);

} // namespace grid
