#include "afxsplit.h"

#include <algorithm>

bool CSplitterWnd::CreateStatic(CWnd* parent, int rows, int cols, DWORD style, UINT id) {
    if (rows != 1 || cols < 1 || cols > 2) // this splitter knows one row of one or two columns
        return false;
    m_nRows = rows;
    m_nCols = cols;
    const char* cls = AfxRegisterWndClass(CS_DBLCLKS, ::LoadCursorA(nullptr, IDC_ARROW),
                                          reinterpret_cast<HBRUSH>(COLOR_BTNFACE + 1), nullptr);
    return CWnd::CreateEx(0, cls, nullptr, style | WS_CHILD | WS_CLIPCHILDREN, CRect(), parent, id);
}

bool CSplitterWnd::CreateView(int row, int col, const std::function<CView*()>& factory, SIZE size,
                              CCreateContext* context) {
    if (row != 0 || col < 0 || col >= m_nCols || GetPane(row, col))
        return false;
    CView* view = factory ? factory() : nullptr;
    if (!view)
        return false;
    m_cols[col].ideal = size.cx;
    if (!view->Create(nullptr, nullptr, WS_CHILD | WS_VISIBLE | WS_BORDER, CRect(), this,
                      static_cast<UINT>(IdFromRowCol(row, col)), context)) {
        if (!view->m_hWnd && view->m_bAutoDelete)
            delete view; // never had a window, so PostNcDestroy never ran
        return false;
    }
    RecalcLayout();
    return true;
}

CWnd* CSplitterWnd::GetPane(int row, int col) const {
    return FromHandle(::GetDlgItem(m_hWnd, IdFromRowCol(row, col)));
}

void CSplitterWnd::GetColumnInfo(int col, int& cur, int& min) const {
    cur = min = 0;
    if (col >= 0 && col < m_nCols) {
        cur = m_cols[col].cur;
        min = m_cols[col].min;
    }
}

void CSplitterWnd::SetColumnInfo(int col, int ideal, int min) {
    if (col < 0 || col >= m_nCols)
        return;
    m_cols[col].ideal = ideal;
    m_cols[col].min = min;
}

void CSplitterWnd::RecalcLayout() {
    if (!m_hWnd)
        return;
    CRect client = GetClientRect();
    if (m_nCols == 1) {
        m_cols[0].cur = client.Width();
    } else {
        // The first column gets its ideal width (none when that is below its minimum), the second the rest,
        // but never less than its own minimum (half the room when there is not enough): a width stored in a
        // larger window leaves the second pane and the bar in reach.
        int avail = std::max(0, client.Width() - m_cxSplitter);
        const int keepSecond = std::min(std::max(0, m_cols[1].min), avail / 2);
        int first = std::clamp(m_cols[0].ideal, 0, avail - keepSecond);
        if (first < m_cols[0].min)
            first = 0;
        m_cols[0].cur = first;
        m_cols[1].cur = avail - first;
    }
    int x = 0;
    for (int col = 0; col < m_nCols; ++col) {
        if (CWnd* pane = GetPane(0, col))
            pane->MoveWindow(x, 0, m_cols[col].cur, client.Height());
        x += m_cols[col].cur + m_cxSplitter;
    }
    InvalidateRect(BarRect());
}

CRect CSplitterWnd::BarRect() const {
    if (m_nCols < 2)
        return CRect();
    CRect client = GetClientRect();
    return CRect(m_cols[0].cur, 0, m_cols[0].cur + m_cxSplitter, client.Height());
}

LRESULT CSplitterWnd::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_CAPTURECHANGED && m_bTracking && reinterpret_cast<HWND>(lParam) != m_hWnd)
        m_bTracking = false;
    return CWnd::WindowProc(message, wParam, lParam);
}

void CSplitterWnd::OnSize(UINT type, int cx, int cy) {
    Default();
    RecalcLayout();
}

void CSplitterWnd::OnPaint() {
    CPaintDC dc(m_hWnd);
    CRect bar = BarRect();
    if (bar.IsRectEmpty())
        return;
    dc.FillRect(bar, ::GetSysColorBrush(COLOR_BTNFACE));
    dc.DrawEdge(bar, EDGE_RAISED, BF_LEFT | BF_RIGHT);
}

bool CSplitterWnd::OnSetCursor(HWND wnd, UINT hitTest, UINT message) {
    CPoint pt;
    ::GetCursorPos(&pt);
    ScreenToClient(&pt);
    if (wnd == m_hWnd && hitTest == HTCLIENT && (m_bTracking || BarRect().PtInRect(pt))) {
        ::SetCursor(::LoadCursorA(nullptr, IDC_SIZEWE));
        return true;
    }
    return Default() != 0;
}

void CSplitterWnd::OnLButtonDown(UINT flags, CPoint pt) {
    CRect bar = BarRect();
    if (!bar.PtInRect(pt)) {
        Default();
        return;
    }
    m_bTracking = true;
    m_trackOffset = pt.x - bar.left;
    SetCapture();
    ::SetCursor(::LoadCursorA(nullptr, IDC_SIZEWE));
}

void CSplitterWnd::OnMouseMove(UINT flags, CPoint pt) {
    if (!m_bTracking) {
        Default();
        return;
    }
    // Live tracking: the panes follow the mouse.
    int width = std::max(0, static_cast<int>(pt.x) - m_trackOffset);
    if (width != m_cols[0].ideal) {
        m_cols[0].ideal = width;
        RecalcLayout();
        UpdateWindow();
    }
}

void CSplitterWnd::OnLButtonUp(UINT flags, CPoint pt) {
    if (!m_bTracking) {
        Default();
        return;
    }
    OnMouseMove(flags, pt);
    m_bTracking = false;
    ::ReleaseCapture();
}

bool CSplitterWnd::OnCommand(WPARAM wParam, LPARAM lParam) {
    if (CWnd::OnCommand(wParam, lParam))
        return true;
    // What the panes do not handle goes to the frame.
    if (HWND parent = GetParentHwnd())
        ::SendMessageA(parent, WM_COMMAND, wParam, lParam);
    return true;
}

bool CSplitterWnd::OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult) {
    if (CWnd::OnNotify(wParam, lParam, pResult))
        return true;
    if (HWND parent = GetParentHwnd()) {
        *pResult = ::SendMessageA(parent, WM_NOTIFY, wParam, lParam);
        return true;
    }
    return false;
}
