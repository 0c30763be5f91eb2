// The grid view in real windows: layout, the ring of controls while scrolling through thousands of
// drawings, the jumps of the keyboard and the scroll bar, cell sizes and alignment.
#include "GridTestSupport.h"

#include "res/resource.h"
#include "thumbs/GridMath.h"
#include "thumbs/TooltipText.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>

namespace {

class TestApp : public CWinApp {
public:
    TestApp() : CWinApp("ThumbsWinTests") {}
};
TestApp theApp;

int RowPitch(CTessel3View& view) {
    return view.GetPictureHeight() + CTessel3View::LabelHeight();
}

// The drawing shown at the top left is the first drawing of the first row, at the top of the client.
void ExpectFirstRowAtTop(CTessel3View& view) {
    exCDwgThumbnail* first = view.ControlOf(view.GetFirstRow() * view.GetColumns());
    ASSERT_NE(first, nullptr) << "first row " << view.GetFirstRow();
    EXPECT_EQ(RectInView(first->m_hWnd, view.m_hWnd).top, 0) << "first row " << view.GetFirstRow();
}

TEST(GridLayout, TenDrawingsInThreeColumns) {
    GridBench bench(700, 600);
    FillList(10, "C:\\drawings");
    bench.view().Rebuild();
    Pump();
    CTessel3View& view = bench.view();
    EXPECT_EQ(Frame().title, "C:\\drawings");
    EXPECT_EQ(view.GetColumns(), 3); // (700 + 5) / 178
    EXPECT_EQ(view.GetRows(), 4);
    EXPECT_EQ(view.GetVisibleRows(), 600 / RowPitch(view));
    EXPECT_EQ(view.GetPoolRows(), view.GetVisibleRows() + 2);
    EXPECT_EQ(view.GetPoolSize(), 3 * view.GetPoolRows());
    EXPECT_EQ(LiveThumbnails(view.m_hWnd), 10);
    EXPECT_EQ(LiveLabels(view.m_hWnd), 10);
    // The last row holds one control, in the first column.
    exCDwgThumbnail* last = view.ControlOf(9);
    ASSERT_NE(last, nullptr);
    CRect rc = RectInView(last->m_hWnd, view.m_hWnd);
    EXPECT_EQ(rc.left, 0);
    EXPECT_EQ(rc.top, 3 * RowPitch(view));
    EXPECT_EQ(rc.Width(), 173);
    EXPECT_EQ(rc.Height(), 143);
    EXPECT_TRUE(last->GetStyle() & WS_BORDER);
    exCDwgThumbnail* fifth = view.ControlOf(4);
    ASSERT_NE(fifth, nullptr);
    EXPECT_EQ(RectInView(fifth->m_hWnd, view.m_hWnd).left, 178);
    EXPECT_EQ(RectInView(fifth->m_hWnd, view.m_hWnd).top, RowPitch(view));
    // The label lies under the picture, inset by the edges.
    CRect label = RectInView(fifth->Label().m_hWnd, view.m_hWnd);
    const int cx = ::GetSystemMetrics(SM_CXEDGE), cy = ::GetSystemMetrics(SM_CYEDGE);
    EXPECT_EQ(label.left, 178 + cx);
    EXPECT_EQ(label.right, 178 + 173 - cx);
    EXPECT_EQ(label.top, RowPitch(view) + 143 + cy);
    EXPECT_EQ(label.bottom, RowPitch(view) + 143 + CTessel3View::LabelHeight() - cy);
    EXPECT_EQ(fifth->Label().GetWindowText(), "d00004.dwg");
    EXPECT_TRUE(fifth->Label().GetStyle() & ES_READONLY);
    // Showing the folder set the title to the folder and refreshed the status.
    EXPECT_EQ(Frame().statusUpdates, 1);
}

TEST(GridLayout, ThumbnailsDrawWhatTheLoaderReadWithoutTheHostsOperation) {
    GridBench bench(700, 600);
    FillList(4);
    bench.view().Rebuild();
    Paints() = PaintRecord{};
    bench.view().RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW | RDW_ALLCHILDREN);
    SettlePictures();
    // The drawings of the list are no files: the loader's read says so, and each cell shows the
    // no-preview mark (grey lines crossing at its centre) on the black background, drawn from memory.
    EXPECT_EQ(Paints().count, 0) << "the host's operation is only for pictures the library cannot draw";
    for (int i = 0; i < 4; ++i) {
        exCDwgThumbnail* control = bench.view().ControlOf(i);
        ASSERT_NE(control, nullptr);
        CClientDC dc(control->m_hWnd);
        const CRect client = control->GetClientRect();
        EXPECT_EQ(::GetPixel(dc.GetSafeHdc(), client.Width() / 2, client.Height() / 2), RGB(128, 128, 128))
            << i;
        EXPECT_EQ(::GetPixel(dc.GetSafeHdc(), 3, 3), RGB(0, 0, 0)) << i;
    }
}

TEST(GridLayout, EmptyListHasNoControls) {
    GridBench bench(700, 600);
    FillList(0);
    bench.view().Rebuild();
    EXPECT_EQ(bench.view().GetRows(), 0);
    EXPECT_EQ(bench.view().GetPoolRows(), 0);
    EXPECT_EQ(LiveThumbnails(bench.view().m_hWnd), 0);
}

TEST(GridScroll, DownArrowThroughThreeThousandDrawingsKeepsTheRing) {
    GridBench bench(1000, 600); // 5 columns, 600 rows
    FillList(3000);
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    const int columns = view.GetColumns();
    const int rows = view.GetRows();
    ASSERT_EQ(rows, (3000 + columns - 1) / columns);
    ASSERT_GT(rows * RowPitch(view), grid::kScrollCap); // more rows than the capped range holds
    const int limit = columns * (view.GetVisibleRows() + 2);
    int lastY = 0;
    int steps = 0;
    while (view.GetFirstRow() + view.GetVisibleRows() < rows && steps < rows + 5) {
        const int before = view.GetFirstRow();
        view.SetFocus();
        PressKey(VK_DOWN);
        ++steps;
        ASSERT_EQ(view.GetFirstRow(), before + 1) << "step " << steps;
        ASSERT_LE(LiveThumbnails(view.m_hWnd), limit) << "step " << steps;
        ASSERT_LE(LiveLabels(view.m_hWnd), limit) << "step " << steps;
        // The thumb only goes down on the way down.
        const int y = view.GetScrollPosition().y;
        ASSERT_GE(y, lastY) << "step " << steps;
        lastY = y;
        if (steps % 97 == 0)
            ExpectFirstRowAtTop(view);
    }
    EXPECT_EQ(view.GetFirstRow(), rows - view.GetVisibleRows());
    // At the last page the thumb is at the bottom of the bar.
    SCROLLINFO info{};
    info.cbSize = sizeof info;
    info.fMask = SIF_ALL;
    ASSERT_TRUE(::GetScrollInfo(view.m_hWnd, SB_VERT, &info));
    EXPECT_EQ(info.nPos, info.nMax - static_cast<int>(info.nPage) + 1);
    ExpectFirstRowAtTop(view);
    // The very last drawing is on screen.
    exCDwgThumbnail* last = view.ControlOf(2999);
    ASSERT_NE(last, nullptr);
    CRect client = view.GetClientRect();
    CRect rc = RectInView(last->m_hWnd, view.m_hWnd);
    EXPECT_GE(rc.top, 0);
    EXPECT_LE(rc.bottom, client.bottom);
    // No further step at the bottom.
    PressKey(VK_DOWN);
    EXPECT_EQ(view.GetFirstRow(), rows - view.GetVisibleRows());
    // And back up a few rows, the contents following.
    for (int i = 0; i < 5; ++i)
        PressKey(VK_UP);
    EXPECT_EQ(view.GetFirstRow(), rows - view.GetVisibleRows() - 5);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), limit);
    ExpectFirstRowAtTop(view);
    std::printf("%s\n", KeyPressSummary().c_str());
}

// What every live control shows matches its drawing: name, label, tooltip, highlight, and its cell.
void ExpectControlsShowTheirDrawings(CTessel3View& view, int step) {
    const int columns = view.GetColumns();
    const int pitch = RowPitch(view);
    int checked = 0;
    for (int index = 0; index < DwgList.GetSize(); ++index) {
        exCDwgThumbnail* control = view.ControlOf(index);
        if (!control)
            continue;
        ++checked;
        const DwgData& record = DwgList[index];
        EXPECT_EQ(control->Name(), record.m_strName) << "step " << step;
        EXPECT_EQ(control->Label().GetWindowText(), record.m_strName) << "step " << step;
        EXPECT_EQ(control->ToolTipText(),
                  BuildTooltipForTime(record.m_strName, record.m_nSize, record.m_timeWrite).text);
        DWORD start = 0, end = 0;
        control->Label().SendMessage(EM_GETSEL, reinterpret_cast<WPARAM>(&start),
                                     reinterpret_cast<LPARAM>(&end));
        EXPECT_EQ(end > start, record.IsSelected()) << record.m_strName << " step " << step;
        // Its cell: the column of its index, the row's place relative to the first row's.
        const CRect picture = RectInView(control->m_hWnd, view.m_hWnd);
        const CRect label = RectInView(control->Label().m_hWnd, view.m_hWnd);
        exCDwgThumbnail* firstOfItsColumn = view.ControlOf(view.GetFirstRow() * columns + index % columns);
        if (firstOfItsColumn) {
            const CRect top = RectInView(firstOfItsColumn->m_hWnd, view.m_hWnd);
            EXPECT_EQ(picture.left, top.left) << record.m_strName;
            EXPECT_EQ(picture.top - top.top, (index / columns - view.GetFirstRow()) * pitch)
                << record.m_strName;
        }
        EXPECT_GT(label.top, picture.top) << record.m_strName;
        EXPECT_LT(label.top - picture.bottom, 4) << record.m_strName;
        EXPECT_GE(label.left, picture.left) << record.m_strName;
    }
    EXPECT_GE(checked, columns * view.GetVisibleRows()) << "step " << step;
}

TEST(GridScroll, RowsScrolledIntoViewShowTheirOwnDrawingsNamesTooltipsAndSelection) {
    GridBench bench(1000, 600);
    FillList(400);
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    const int columns = view.GetColumns();
    // Every seventh drawing is selected: rows that come in show theirs, rows that go take none along.
    for (int index = 0; index < DwgList.GetSize(); index += 7)
        DwgList[index].Select();
    view.Rebuild();
    Pump();
    for (int index = 0; index < DwgList.GetSize(); index += 7)
        DwgList[index].Select();
    int step = 0;
    for (; step < view.GetVisibleRows() * 3; ++step) {
        view.SetFocus();
        PressKey(VK_DOWN);
        ExpectControlsShowTheirDrawings(view, step);
    }
    for (int up = 0; up < view.GetVisibleRows() + 3; ++up, ++step) {
        PressKey(VK_UP);
        ExpectControlsShowTheirDrawings(view, step);
    }
    EXPECT_GT(view.GetFirstRow(), 0);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), columns * (view.GetVisibleRows() + 2));
}

namespace {

// The view's client area as the window system holds it for the screen.
std::vector<COLORREF> ClientPixels(CTessel3View& view) {
    const CRect client = view.GetClientRect();
    HDC source = ::GetDC(view.m_hWnd);
    HDC memory = ::CreateCompatibleDC(source);
    HBITMAP bitmap = ::CreateCompatibleBitmap(source, client.Width(), client.Height());
    HGDIOBJ old = ::SelectObject(memory, bitmap);
    ::BitBlt(memory, 0, 0, client.Width(), client.Height(), source, 0, 0, SRCCOPY);
    std::vector<COLORREF> pixels;
    for (int y = 0; y < client.Height(); y += 2)
        for (int x = 0; x < client.Width(); x += 2)
            pixels.push_back(::GetPixel(memory, x, y));
    ::SelectObject(memory, old);
    ::DeleteObject(bitmap);
    ::DeleteDC(memory);
    ::ReleaseDC(view.m_hWnd, source);
    return pixels;
}

// Where what is shown after a step differs from what a repaint of everything draws.
int DiffersFromARepaint(CTessel3View& view) {
    const std::vector<COLORREF> shown = ClientPixels(view);
    view.RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_ALLCHILDREN | RDW_UPDATENOW);
    Pump();
    const std::vector<COLORREF> repainted = ClientPixels(view);
    int differing = 0;
    for (std::size_t i = 0; i < shown.size() && i < repainted.size(); ++i)
        differing += shown[i] != repainted[i];
    return differing;
}

} // namespace

// A step moves the sheet the controls sit on, and every twenty-odd steps the sheet moves back while its
// controls move the other way, painting nothing: through a long scroll down and back up, the first row
// shown stays at the top with each row one pitch below the one before, and the screen shows exactly what
// a repaint of everything would draw.
TEST(GridScroll, ALongScrollKeepsEveryRowInPlaceAndTheScreenAsARepaintDrawsIt) {
    GridBench bench(1000, 600);
    FillList(1200);
    CTessel3View& view = bench.view();
    view.Rebuild();
    SettlePictures(); // the first screen's pictures have arrived
    const int pitch = RowPitch(view);
    const int steps = 2 * 4096 / pitch + 10; // beyond two moves back of the sheet
    ASSERT_LT(steps, view.GetRows() - view.GetVisibleRows());
    const std::vector<COLORREF> atTop = ClientPixels(view);
    int step = 0;
    for (int down = 0; down < steps; ++down, ++step) {
        view.SetFocus();
        PressKey(VK_DOWN);
        ASSERT_EQ(view.GetFirstRow(), down + 1);
        ExpectFirstRowAtTop(view);
        ExpectControlsShowTheirDrawings(view, step);
        ASSERT_EQ(DiffersFromARepaint(view), 0) << "step " << step;
    }
    for (int up = 0; up < steps; ++up, ++step) {
        view.SetFocus();
        PressKey(VK_UP);
        ASSERT_EQ(view.GetFirstRow(), steps - up - 1);
        ExpectFirstRowAtTop(view);
        ExpectControlsShowTheirDrawings(view, step);
        ASSERT_EQ(DiffersFromARepaint(view), 0) << "step " << step;
    }
    // Back at the top, the grid looks as it did before the scroll.
    EXPECT_EQ(ClientPixels(view), atTop);
}

// The rows wholly below the client area are not needed for the first paint: they are made once the messages
// queued by then are handled, in their cells, and the first step down shows them as a repaint would.
TEST(GridScroll, RowsBelowTheClientAreaAreMadeAfterTheFirstPaintInTheirCells) {
    GridBench bench(1000, 600);
    FillList(300);
    CTessel3View& view = bench.view();
    view.Rebuild();
    const int pitch = RowPitch(view);
    const int columns = view.GetColumns();
    const int clientHeight = view.GetClientRect().Height();
    const int touching = (clientHeight + pitch - 1) / pitch;
    ASSERT_LT(touching, view.GetPoolRows()) << "a pool row lies wholly below the client area";
    EXPECT_EQ(LiveThumbnails(view.m_hWnd), touching * columns) << "before the queued messages";
    for (int index = touching * columns; index < view.GetPoolRows() * columns; ++index)
        EXPECT_EQ(view.ControlOf(index), nullptr) << index;
    Pump();
    EXPECT_EQ(LiveThumbnails(view.m_hWnd), view.GetPoolRows() * columns);
    ExpectControlsShowTheirDrawings(view, 0);
    for (int index = 0; index < view.GetPoolRows() * columns; ++index) {
        exCDwgThumbnail* control = view.ControlOf(index);
        ASSERT_NE(control, nullptr) << index;
        EXPECT_EQ(RectInView(control->m_hWnd, view.m_hWnd).top, index / columns * pitch) << index;
        EXPECT_TRUE(control->Label().IsWindowVisible()) << index;
    }
    for (int step = 1; step <= 3; ++step) {
        view.SetFocus();
        PressKey(VK_DOWN);
        ASSERT_EQ(view.GetFirstRow(), step);
        ExpectFirstRowAtTop(view);
        ExpectControlsShowTheirDrawings(view, step);
        ASSERT_EQ(DiffersFromARepaint(view), 0) << "step " << step;
    }

    // A layout made again before the message came (a resize) leaves the same rows for it.
    view.Rebuild();
    CRect frame;
    ::GetWindowRect(::GetAncestor(view.m_hWnd, GA_ROOT), &frame);
    ::SetWindowPos(::GetAncestor(view.m_hWnd, GA_ROOT), nullptr, 0, 0, frame.Width(), frame.Height() + pitch,
                   SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE);
    Pump();
    EXPECT_EQ(LiveThumbnails(view.m_hWnd), view.GetPoolRows() * columns);
    ExpectControlsShowTheirDrawings(view, 4);
}

TEST(GridScroll, EndHomePageDownPageUp) {
    GridBench bench(700, 600);
    FillList(900); // 300 rows: beyond the capped range
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    const int rows = view.GetRows();
    const int visible = view.GetVisibleRows();
    const int limit = view.GetColumns() * (visible + 2);

    PressKey(VK_END);
    EXPECT_EQ(view.GetFirstRow(), rows - visible);
    EXPECT_NE(view.ControlOf(899), nullptr);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), limit);
    ExpectFirstRowAtTop(view);

    PressKey(VK_HOME);
    EXPECT_EQ(view.GetFirstRow(), 0);
    EXPECT_EQ(view.GetScrollPosition().y, 0);
    ExpectFirstRowAtTop(view);

    PressKey(VK_NEXT);
    EXPECT_EQ(view.GetFirstRow(), visible);
    ExpectFirstRowAtTop(view);
    // Less than a page below the top: Page Up goes to the very top.
    const int half = std::max(1, visible / 2);
    for (int i = 0; i < half; ++i)
        PressKey(VK_DOWN);
    EXPECT_EQ(view.GetFirstRow(), visible + half);
    PressKey(VK_PRIOR);
    EXPECT_EQ(view.GetFirstRow(), half < visible ? 0 : half);

    // Page Down all the way reaches the last row and stops there.
    for (int i = 0; i < rows; ++i) {
        PressKey(VK_NEXT);
        if (view.GetFirstRow() == rows - visible)
            break;
    }
    EXPECT_EQ(view.GetFirstRow(), rows - visible);
    PressKey(VK_NEXT);
    EXPECT_EQ(view.GetFirstRow(), rows - visible);
    EXPECT_NE(view.ControlOf(899), nullptr);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), limit);
    ExpectFirstRowAtTop(view);
}

TEST(GridScroll, ScrollBarLinesAndTheWheelStepOneRowPagesAPageTheThumbGoesWhereItIsPut) {
    GridBench bench(700, 600);
    FillList(300);
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    const int rows = view.GetRows();
    const int visible = view.GetVisibleRows();
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEDOWN, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 1);
    // A click in the trough moves a page, as Page Down and Page Up do.
    ASSERT_GT(visible, 1);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_PAGEDOWN, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 1 + visible);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_PAGEUP, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), grid::PageUpFirstRow(1 + visible, visible));
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_TOP, 0), 0);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEDOWN, 0), 0);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEUP, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 0);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEUP, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 0);
    // The thumb let go half-way down the bar: the grid goes half-way and the thumb stays there.
    SCROLLINFO info{};
    info.cbSize = sizeof info;
    info.fMask = SIF_ALL;
    ASSERT_TRUE(::GetScrollInfo(view.m_hWnd, SB_VERT, &info));
    const int maxPos = info.nMax - static_cast<int>(info.nPage) + 1;
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_THUMBPOSITION, maxPos / 2), 0);
    EXPECT_EQ(view.GetFirstRow(), grid::RowOfBarPos(maxPos / 2, rows - visible, maxPos));
    EXPECT_NEAR(view.GetFirstRow(), (rows - visible) / 2, 1);
    EXPECT_NEAR(view.GetScrollPosition().y, maxPos / 2, maxPos / (rows - visible) + 1);
    ExpectFirstRowAtTop(view);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_TOP, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 0);
    CRect rc = view.GetWindowRect();
    view.SendMessage(WM_MOUSEWHEEL, MAKEWPARAM(0, static_cast<WORD>(-WHEEL_DELTA)),
                     MAKELPARAM(rc.left + 5, rc.top + 5));
    EXPECT_EQ(view.GetFirstRow(), 1);
    // The scroll bar alone reaches the last row.
    for (int i = 0; i < rows; ++i)
        view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEDOWN, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), rows - visible);
    EXPECT_NE(view.ControlOf(299), nullptr);
    ExpectFirstRowAtTop(view);
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_TOP, 0), 0);
    EXPECT_EQ(view.GetFirstRow(), 0);
    ExpectFirstRowAtTop(view);
}

TEST(GridSize, IncreaseDecreaseAndTheirLimits) {
    GridBench bench(700, 600);
    FillList(50);
    CTessel3View& view = bench.view();
    view.Rebuild();
    view.SendMessage(WM_COMMAND, ID_VIEW_INCREASE);
    EXPECT_EQ(view.GetPictureHeight(), 179);
    EXPECT_EQ(view.GetPictureWidth(), 216);
    EXPECT_EQ(view.GetColumns(), (view.GetClientRect().right + 5) / (216 + 5));
    exCDwgThumbnail* first = view.ControlOf(0);
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(first->GetClientRect().Height() + 2, 179); // one-pixel border
    view.SendMessage(WM_COMMAND, ID_VIEW_DECREASE);
    EXPECT_EQ(view.GetPictureHeight(), 143);
    EXPECT_EQ(view.GetPictureWidth(), 173);
    // Down to the smallest size, then no further.
    for (int i = 0; i < 20; ++i)
        view.Decrease();
    EXPECT_EQ(view.GetPictureHeight(), grid::SmallestPicture().height);
    EXPECT_EQ(view.GetPictureWidth(), grid::SmallestPicture().width);
    const int h = view.GetPictureHeight(), w = view.GetPictureWidth();
    view.Decrease();
    EXPECT_EQ(view.GetPictureHeight(), h);
    EXPECT_EQ(view.GetPictureWidth(), w);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), view.GetColumns() * (view.GetVisibleRows() + 2));
    // Up until the picture would no longer fit the client height.
    for (int i = 0; i < 40; ++i)
        view.Increase();
    EXPECT_LT(view.GetPictureHeight(), view.GetClientRect().Height());
    EXPECT_GE(view.GetPictureHeight() * 5 / 4, view.GetClientRect().Height());
}

std::string PictureSettings(const std::string& width, const std::string& height) {
    return "[View]\r\nPictureWidth=" + width + "\r\nPictureHeight=" + height + "\r\n";
}

TEST(GridSize, StoredPictureSizesAreClampedToWhatTheCommandsReach) {
    const int screenHeight = ::GetSystemMetrics(SM_CYVIRTUALSCREEN);
    const grid::PictureSize largest = grid::LargestPicture(screenHeight);
    const struct {
        const char* width;
        const char* height;
        int expectedWidth;
        int expectedHeight;
    } cases[] = {
        {"200", "150", 200, 150},
        {"1", "1", grid::SmallestPicture().width, grid::SmallestPicture().height},
        {"-40", "-7", grid::SmallestPicture().width, grid::SmallestPicture().height},
        {"2147483647", "99999999", largest.width, largest.height},
        {"-2147483648", "5000000", grid::SmallestPicture().width, largest.height},
        {"0", "1", grid::kDefaultCellWidth, grid::kDefaultCellHeight}, // one side 0: the default
    };
    for (const auto& c : cases) {
        GridBench bench(700, 600, PictureSettings(c.width, c.height));
        EXPECT_EQ(bench.view().GetPictureWidth(), c.expectedWidth) << c.width << " x " << c.height;
        EXPECT_EQ(bench.view().GetPictureHeight(), c.expectedHeight) << c.width << " x " << c.height;
        FillList(500);
        bench.view().Rebuild();
        Pump();
        EXPECT_LE(LiveThumbnails(bench.view().m_hWnd), grid::kMaxLiveThumbnails);
    }
}

TEST(GridSize, NoWindowSizeHoldsMoreThanTheLiveLimit) {
    // The smallest pictures in a client as large as two 4K screens each way: the cells grow instead.
    // A top-level window is kept within the screen; the view, a child, is not.
    GridBench bench(700, 600, PictureSettings("1", "1"));
    CTessel3View& view = bench.view();
    view.MoveWindow(0, 0, 2 * grid::kReferenceScreenWidth, 2 * grid::kReferenceScreenHeight);
    const CRect client = view.GetClientRect();
    ASSERT_GT(client.Width(), grid::kReferenceScreenWidth) << "the window could not be made that large";
    FillList(20000);
    view.Rebuild();
    Pump();
    const int live = LiveThumbnails(view.m_hWnd);
    EXPECT_LE(live, grid::kMaxLiveThumbnails);
    EXPECT_LE(view.GetPoolSize(), grid::kMaxLiveThumbnails);
    EXPECT_GT(live, grid::kMaxLiveThumbnails / 4) << "the client is still filled";
    EXPECT_GT(view.GetPictureHeight(), grid::SmallestPicture().height);
    // Decrease does not get below what the client allows either.
    view.Decrease();
    Pump();
    EXPECT_LE(LiveThumbnails(view.m_hWnd), grid::kMaxLiveThumbnails);
    std::printf("client %d x %d: %d live thumbnails of %d x %d\n", client.Width(), client.Height(), live,
                view.GetPictureWidth(), view.GetPictureHeight());
}

// Align goes to the nearest whole columns and rows: a client short of a column by less than half of one
// grows to hold it.
TEST(GridSize, AlignGrowsTheFrameWhenMoreThanHalfAColumnAndRowIsLeftOver) {
    GridBench bench(700, 600);
    FillList(200);
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    const int pitch = 173 + 5;
    const int rowPitch = RowPitch(view);
    // Short of 4 columns by 20 pixels, of 4 rows by 20 pixels.
    CRect frame;
    ::GetWindowRect(Frame().frame, &frame);
    const CRect before = view.GetClientRect();
    ::MoveWindow(Frame().frame, 0, 0, frame.Width() + (4 * pitch - 5 - 20) - before.right,
                 frame.Height() + (4 * rowPitch - 20) - before.bottom, TRUE);
    Pump();
    ASSERT_EQ(view.GetClientRect().right, 4 * pitch - 5 - 20);
    view.SendMessage(WM_COMMAND, ID_VIEW_ALIGNE);
    Pump();
    const CRect client = view.GetClientRect();
    EXPECT_EQ(client.right, 4 * pitch - 5) << "grown to 4 whole columns";
    EXPECT_EQ(client.bottom, 4 * rowPitch) << "grown to 4 whole rows";
    EXPECT_EQ(view.GetColumns(), 4);
}

TEST(GridSize, AlignFitsTheFrameToWholeColumnsAndRows) {
    GridBench bench(731, 611);
    FillList(200);
    CTessel3View& view = bench.view();
    view.Rebuild();
    Pump();
    view.SendMessage(WM_COMMAND, ID_VIEW_ALIGNE);
    Pump();
    const CRect client = view.GetClientRect();
    const int pitch = 173 + 5;
    EXPECT_EQ((client.right + 5) % pitch, 0) << client.right;
    EXPECT_EQ(client.bottom % RowPitch(view), 0) << client.bottom;
    EXPECT_EQ(view.GetColumns(), (client.right + 5) / pitch);
}

TEST(GridKeys, EscapeCancelsTabGoesToTheAcceptAndCancelButtons) {
    GridBench bench(700, 600);
    FillList(20);
    bench.view().Rebuild();
    Pump();
    bench.view().SetFocus();
    PressKey(VK_TAB);
    EXPECT_EQ(Frame().pickFocusRequests, 1);
    EXPECT_EQ(Frame().treeFocusRequests, 0);
    bench.view().SetFocus();
    PressKey(VK_ESCAPE);
    Pump();
    ASSERT_EQ(Main().results.size(), 1u);
    EXPECT_EQ(Main().results[0], 2u);
}

TEST(GridKeys, EnterTakesTheChosenDrawingOnly) {
    GridBench bench(700, 600);
    FillList(20);
    bench.view().Rebuild();
    Pump();
    bench.view().SetFocus();
    PressKey(VK_RETURN);
    Pump();
    EXPECT_TRUE(Main().results.empty()) << "nothing chosen: Enter takes nothing";
    Drawings().Choose(3);
    bench.view().SetFocus();
    PressKey(VK_RETURN);
    Pump();
    ASSERT_EQ(Main().results.size(), 1u);
    EXPECT_EQ(Main().results[0], 1u);
}

TEST(GridKeys, KeysOnAThumbnailReachTheGrid) {
    GridBench bench(700, 600);
    FillList(300);
    bench.view().Rebuild();
    Pump();
    exCDwgThumbnail* control = bench.view().ControlOf(1);
    ASSERT_NE(control, nullptr);
    control->SetFocus();
    ::PostMessageA(control->m_hWnd, WM_KEYDOWN, VK_DOWN, 1);
    Pump();
    EXPECT_EQ(bench.view().GetFirstRow(), 1);
    EXPECT_EQ(::GetFocus(), bench.view().m_hWnd);
}

// The label of a control shows its whole text selected.
bool ShowsSelected(exCDwgThumbnail& control) {
    int start = 0, end = 0;
    control.Label().GetSel(start, end);
    return start == 0 && end == control.Label().GetWindowTextLength() && end > 0;
}

TEST(GridSelection, SelectAllMarksEveryRecordAndEveryLabelOnScreenShowsIt) {
    GridBench bench(700, 600);
    FillList(40);
    bench.view().Rebuild();
    Pump();
    bench.view().SendMessage(WM_COMMAND, ID_SELECT_ALL);
    for (int i = 0; i < DwgList.GetSize(); ++i)
        EXPECT_TRUE(DwgList[i].IsSelected());
    int shown = 0;
    for (int i = 0; i < DwgList.GetSize(); ++i) {
        if (exCDwgThumbnail* control = bench.view().ControlOf(i)) {
            ++shown;
            EXPECT_TRUE(ShowsSelected(*control)) << i;
        }
    }
    EXPECT_GT(shown, 6);
    bench.view().DeselectAll();
    EXPECT_FALSE(AnySelected());
    for (int i = 0; i < DwgList.GetSize(); ++i) {
        if (exCDwgThumbnail* control = bench.view().ControlOf(i)) {
            EXPECT_FALSE(ShowsSelected(*control)) << i;
        }
    }
}

TEST(GridSearch, AHitWhoseRowsAllFitTheWindowHidesNothingBeforeIt) {
    GridBench bench(700, 600); // three columns, three whole rows
    FillList(8);
    bench.view().Rebuild();
    Pump();
    bench.view().ShowIndex(7);
    Pump();
    EXPECT_EQ(bench.view().GetFirstRow(), 0);
    EXPECT_NE(bench.view().ControlOf(0), nullptr) << "the first drawing stays on screen";
}

TEST(GridSearch, AHitNearTheEndIsShownWithTheLastRowsFillingTheWindow) {
    GridBench bench(700, 600);
    FillList(60); // 20 rows
    bench.view().Rebuild();
    Pump();
    const int visible = bench.view().GetVisibleRows();
    bench.view().ShowIndex(58);
    Pump();
    EXPECT_EQ(bench.view().GetFirstRow(), bench.view().GetRows() - visible) << "no blank space after the end";
    EXPECT_NE(bench.view().ControlOf(58), nullptr);
    bench.view().ShowIndex(30); // row 10: at the top
    Pump();
    EXPECT_EQ(bench.view().GetFirstRow(), 10);
}

TEST(GridSort, RebuildSortsEveryDrawingByTheFrameMode) {
    GridBench bench(700, 600);
    BeginScan();
    // Found last, first by name: it leads the grid.
    const char* names[] = {"c.dwg", "b.dwg", "d.dwg", "a.dwg"};
    for (int i = 0; i < 4; ++i) {
        DwgFindEntry e;
        e.name = names[i];
        e.size = static_cast<std::uint64_t>(10 - i);
        AppendScanEntry(e);
    }
    EndScan();
    Frame().sortMode = 0;
    bench.view().Rebuild();
    EXPECT_EQ(DwgList[0].m_strName, "a.dwg");
    EXPECT_EQ(DwgList[1].m_strName, "b.dwg");
    EXPECT_EQ(DwgList[2].m_strName, "c.dwg");
    EXPECT_EQ(DwgList[3].m_strName, "d.dwg");
    ASSERT_NE(bench.view().ControlOf(0), nullptr);
    EXPECT_EQ(bench.view().ControlOf(0)->Label().GetWindowText(), "a.dwg");
    ASSERT_NE(bench.view().ControlOf(3), nullptr);
    EXPECT_EQ(bench.view().ControlOf(3)->Label().GetWindowText(), "d.dwg");
}

} // namespace

namespace {

TEST(GridLayout, ColumnsFitBesideTheVerticalScrollBar) {
    // 710 pixels hold 4 columns (707) until the vertical bar takes its width.
    GridBench bench(710, 600);
    FillList(300);
    bench.view().Rebuild();
    Pump();
    CTessel3View& view = bench.view();
    const CRect client = view.GetClientRect();
    EXPECT_TRUE(view.GetStyle() & WS_VSCROLL);
    EXPECT_LE(view.GetColumns() * 178 - 5, client.Width());
    EXPECT_EQ(view.GetColumns(), (client.Width() + 5) / 178);
    EXPECT_FALSE(view.GetStyle() & WS_HSCROLL);
    EXPECT_LE(LiveThumbnails(view.m_hWnd), view.GetColumns() * (view.GetVisibleRows() + 2));
}

} // namespace
