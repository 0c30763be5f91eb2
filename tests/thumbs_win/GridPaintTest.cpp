// What the screen shows after each jump of the grid: every live cell has its picture and its name, as a
// person would see them, not only a control that exists. The host paints each preview as a solid colour
// through its own device context, as the real one does.
#include "GridTestSupport.h"

#include "hostapi/HostApi.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

namespace {

constexpr COLORREF kPreviewColour = RGB(0, 96, 192);

bool SolidPreview(const wchar_t*, HWND window, const std::uint32_t*) {
    ++Paints().count;
    Paints().windows.push_back(window);
    RECT area{};
    ::GetClientRect(window, &area);
    HDC dc = ::GetDC(window);
    if (!dc)
        return false;
    HBRUSH brush = ::CreateSolidBrush(kPreviewColour);
    ::FillRect(dc, &area, brush);
    ::DeleteObject(brush);
    ::ReleaseDC(window, dc);
    return true;
}

// Lets the windowing system put what was drawn on the screen: an idle wait flushes the window surfaces.
void Settle() {
    for (int i = 0; i < 4; ++i) {
        Pump();
        ::MsgWaitForMultipleObjects(0, nullptr, FALSE, 40, QS_ALLINPUT);
    }
    Pump();
}

// The screen's pixels under the view's client area.
class ScreenShot {
public:
    explicit ScreenShot(HWND view) : m_view(view) {
        CRect client;
        ::GetClientRect(view, &client);
        m_width = client.Width();
        m_height = client.Height();
        POINT origin{0, 0};
        ::ClientToScreen(view, &origin);
        HDC screen = ::GetDC(nullptr);
        HDC memory = ::CreateCompatibleDC(screen);
        BITMAPINFO info{};
        info.bmiHeader.biSize = sizeof info.bmiHeader;
        info.bmiHeader.biWidth = m_width;
        info.bmiHeader.biHeight = -m_height;
        info.bmiHeader.biPlanes = 1;
        info.bmiHeader.biBitCount = 32;
        info.bmiHeader.biCompression = BI_RGB;
        void* bits = nullptr;
        HBITMAP bitmap = ::CreateDIBSection(screen, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
        HGDIOBJ old = ::SelectObject(memory, bitmap);
        ::BitBlt(memory, 0, 0, m_width, m_height, screen, origin.x, origin.y, SRCCOPY);
        ::GdiFlush();
        const auto* p = static_cast<const std::uint32_t*>(bits);
        m_pixels.assign(p, p + static_cast<size_t>(m_width) * static_cast<size_t>(m_height));
        ::SelectObject(memory, old);
        ::DeleteObject(bitmap);
        ::DeleteDC(memory);
        ::ReleaseDC(nullptr, screen);
    }
    // 0x00RRGGBB of a pixel in view client coordinates.
    std::uint32_t At(int x, int y) const {
        if (x < 0 || y < 0 || x >= m_width || y >= m_height)
            return 0xFFFFFFFF;
        return m_pixels[static_cast<size_t>(y) * static_cast<size_t>(m_width) + static_cast<size_t>(x)] &
               0xFFFFFF;
    }
    // Dark pixels (text) inside a rectangle of the view.
    int DarkIn(const CRect& rc) const {
        int dark = 0;
        for (int y = rc.top; y < rc.bottom; ++y)
            for (int x = rc.left; x < rc.right; ++x) {
                const std::uint32_t c = At(x, y);
                if (c != 0xFFFFFFFF && ((c >> 16) & 0xFF) + ((c >> 8) & 0xFF) + (c & 0xFF) < 200)
                    ++dark;
            }
        return dark;
    }

private:
    HWND m_view;
    int m_width = 0;
    int m_height = 0;
    std::vector<std::uint32_t> m_pixels;
};

// Every cell inside the client area shows its picture (here the no-preview mark the loader drew for a
// list of names that are no files: grey lines crossing at its centre, never the black loading state) and
// a name under it.
void ExpectEveryVisibleCellPainted(CTessel3View& view, const char* step) {
    SettlePictures();
    Settle();
    const ScreenShot shot(view.m_hWnd);
    const CRect client = view.GetClientRect();
    const std::uint32_t expected = 0x808080;
    int cells = 0, blankPictures = 0, blankNames = 0;
    std::string blanks;
    const int first = view.GetFirstRow() * view.GetColumns();
    for (int index = first; index < DwgList.GetSize(); ++index) {
        exCDwgThumbnail* control = view.ControlOf(index);
        if (!control)
            break;
        const CRect cell = RectInView(control->m_hWnd, view.m_hWnd);
        const CRect label = RectInView(control->Label().m_hWnd, view.m_hWnd);
        if (label.bottom > client.bottom || cell.right > client.right)
            continue; // cut by the edge
        ++cells;
        const bool picture = shot.At(cell.CenterPoint().x, cell.CenterPoint().y) == expected;
        const bool name = shot.DarkIn(label) > 10;
        if (!picture)
            ++blankPictures;
        if (!name)
            ++blankNames;
        if (!picture || !name)
            blanks += " " + std::to_string(index);
    }
    EXPECT_GT(cells, 0) << step;
    EXPECT_EQ(blankPictures, 0) << step << ": cells without a picture:" << blanks;
    EXPECT_EQ(blankNames, 0) << step << ": cells without a name:" << blanks;
}

TEST(GridPaint, EveryVisibleCellIsPaintedAfterEachJump) {
    GridBench bench(900, 640);
    HostApi api{};
    api.acdbDisplayPreviewFromDwg = &SolidPreview; // the bench installs its counting host
    SetHostApi(api);
    FillList(400);
    CTessel3View& view = bench.view();
    view.Rebuild();
    ExpectEveryVisibleCellPainted(view, "first layout");

    view.ShowIndex(200);
    ExpectEveryVisibleCellPainted(view, "search jump");
    PressKey(VK_HOME);
    ExpectEveryVisibleCellPainted(view, "Home");
    PressKey(VK_END);
    ExpectEveryVisibleCellPainted(view, "End");
    PressKey(VK_PRIOR);
    ExpectEveryVisibleCellPainted(view, "Page Up");
    PressKey(VK_NEXT);
    ExpectEveryVisibleCellPainted(view, "Page Down");
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_TOP, 0), 0);
    ExpectEveryVisibleCellPainted(view, "scroll bar top");
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_BOTTOM, 0), 0);
    ExpectEveryVisibleCellPainted(view, "scroll bar bottom");
    view.SendMessage(WM_VSCROLL, MAKEWPARAM(SB_LINEUP, 0), 0);
    ExpectEveryVisibleCellPainted(view, "scroll bar line up");
    bench.frame().MoveWindow(20, 20, 700, 560);
    ExpectEveryVisibleCellPainted(view, "resize");
}

} // namespace
