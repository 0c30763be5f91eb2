#include "afxview.h"

#include <algorithm>

// ---- CView ------------------------------------------------------------------------------------------

bool CView::Create(const char* className, const char* windowName, DWORD style, const RECT& rect, CWnd* parent,
                   UINT id, CCreateContext* context) {
    if (context)
        m_pDocument = context->m_pCurrentDoc;
    return CWnd::Create(className, windowName, style, rect, parent, id);
}

bool CView::PreCreateWindow(CREATESTRUCTA& cs) {
    if (!cs.lpszClass)
        cs.lpszClass = AfxRegisterWndClass(CS_DBLCLKS, ::LoadCursorA(nullptr, IDC_ARROW),
                                           reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1), nullptr);
    return true;
}

void CView::OnPaint() {
    CPaintDC dc(m_hWnd);
    OnPrepareDC(&dc);
    OnDraw(&dc);
}

void CView::OnActivateView(bool activate, CView*, CView*) {}

void CView::OnSetFocus(HWND oldWnd) {
    Default();
    if (CFrameWnd* frame = GetParentFrame())
        frame->SetActiveView(this, false);
}

void CView::OnLButtonDown(UINT flags, CPoint pt) {
    // A click into a view makes it the active one, as focus does.
    if (::GetFocus() != m_hWnd && !::IsChild(m_hWnd, ::GetFocus()))
        SetFocus();
    Default();
}

void CView::OnDestroy() {
    if (CFrameWnd* frame = GetParentFrame(); frame && frame->GetActiveView() == this)
        frame->SetActiveView(nullptr, false);
    Default();
}

void CView::PostNcDestroy() {
    if (m_bAutoDelete)
        delete this;
}

// ---- CScrollView ------------------------------------------------------------------------------------

void CScrollView::SetScrollSizes(int mapMode, SIZE total, SIZE page, SIZE line) {
    m_nMapMode = mapMode; // only MM_TEXT is drawn: one logical unit is one pixel
    m_totalLog = total;
    m_pageDev = CSize(page.cx ? page.cx : total.cx / 10, page.cy ? page.cy : total.cy / 10);
    m_lineDev = CSize(line.cx ? line.cx : m_pageDev.cx / 10, line.cy ? line.cy : m_pageDev.cy / 10);
    if (m_hWnd) {
        UpdateBars();
        Invalidate();
    }
}

CPoint CScrollView::GetScrollPosition() const {
    return CPoint(::GetScrollPos(m_hWnd, SB_HORZ), ::GetScrollPos(m_hWnd, SB_VERT));
}

void CScrollView::UpdateBars() {
    // The bars are shown only when the total does not fit; the positions stay within the range.
    CRect client = GetClientRect();
    // The client area without bars: bars that are shown now take room that is free again when hidden.
    DWORD style = GetStyle();
    int cx = client.Width() + ((style & WS_VSCROLL) ? ::GetSystemMetrics(SM_CXVSCROLL) : 0);
    int cy = client.Height() + ((style & WS_HSCROLL) ? ::GetSystemMetrics(SM_CYHSCROLL) : 0);
    bool needH = m_totalLog.cx > cx;
    bool needV = m_totalLog.cy > cy;
    if (needV)
        cx -= ::GetSystemMetrics(SM_CXVSCROLL);
    if (needH)
        cy -= ::GetSystemMetrics(SM_CYHSCROLL);
    needH = m_totalLog.cx > cx;
    needV = m_totalLog.cy > cy;

    CPoint old = GetScrollPosition();
    auto apply = [&](int bar, bool need, int total, int page) {
        SCROLLINFO si{};
        si.cbSize = sizeof si;
        si.fMask = SIF_RANGE | SIF_PAGE;
        si.nMin = 0;
        si.nMax = need ? total - 1 : 0;
        si.nPage = need ? static_cast<UINT>(std::max(page, 1)) : 0;
        ::SetScrollInfo(m_hWnd, bar, &si, TRUE);
        ::ShowScrollBar(m_hWnd, bar, need);
    };
    apply(SB_HORZ, needH, m_totalLog.cx, cx);
    apply(SB_VERT, needV, m_totalLog.cy, cy);
    CPoint now = GetScrollPosition();
    if (now != old)
        ::ScrollWindow(m_hWnd, old.x - now.x, old.y - now.y, nullptr, nullptr);
}

int CScrollView::TrackPos(int bar) const {
    SCROLLINFO si{};
    si.cbSize = sizeof si;
    si.fMask = SIF_TRACKPOS;
    ::GetScrollInfo(m_hWnd, bar, &si);
    return si.nTrackPos;
}

void CScrollView::ScrollToPosition(POINT pt) {
    CPoint now = GetScrollPosition();
    OnScrollBy(CSize(pt.x - now.x, pt.y - now.y), true);
}

bool CScrollView::OnScroll(UINT code, UINT pos, bool doScroll) {
    const UINT horz = LOBYTE(code);
    const UINT vert = HIBYTE(code);
    CPoint now = GetScrollPosition();
    CRect client = GetClientRect();
    auto step = [&](UINT c, int cur, int page, int line, int thumb, int total) {
        switch (c) {
        case SB_TOP:
            return 0;
        case SB_BOTTOM:
            return total;
        case SB_LINEUP:
            return cur - line;
        case SB_LINEDOWN:
            return cur + line;
        case SB_PAGEUP:
            return cur - page;
        case SB_PAGEDOWN:
            return cur + page;
        case SB_THUMBTRACK:
        case SB_THUMBPOSITION:
            return thumb;
        default:
            return cur;
        }
    };
    int x = now.x, y = now.y;
    if (horz != 0xFF)
        x = step(horz, now.x, m_pageDev.cx ? m_pageDev.cx : client.Width(), m_lineDev.cx,
                 (horz == SB_THUMBTRACK || horz == SB_THUMBPOSITION) ? TrackPos(SB_HORZ)
                                                                     : static_cast<int>(pos),
                 m_totalLog.cx);
    if (vert != 0xFF)
        y = step(vert, now.y, m_pageDev.cy ? m_pageDev.cy : client.Height(), m_lineDev.cy,
                 (vert == SB_THUMBTRACK || vert == SB_THUMBPOSITION) ? TrackPos(SB_VERT)
                                                                     : static_cast<int>(pos),
                 m_totalLog.cy);
    return OnScrollBy(CSize(x - now.x, y - now.y), doScroll);
}

bool CScrollView::OnScrollBy(CSize sizeScroll, bool doScroll) {
    CPoint now = GetScrollPosition();
    auto clamp = [&](int bar, int value) {
        SCROLLINFO si{};
        si.cbSize = sizeof si;
        si.fMask = SIF_RANGE | SIF_PAGE;
        ::GetScrollInfo(m_hWnd, bar, &si);
        int max = si.nMax - static_cast<int>(si.nPage > 0 ? si.nPage - 1 : 0);
        return std::max(si.nMin, std::min(value, std::max(max, 0)));
    };
    int x = (GetStyle() & WS_HSCROLL) ? clamp(SB_HORZ, now.x + sizeScroll.cx) : 0;
    int y = (GetStyle() & WS_VSCROLL) ? clamp(SB_VERT, now.y + sizeScroll.cy) : 0;
    if (x == now.x && y == now.y)
        return false;
    if (doScroll) {
        ::SetScrollPos(m_hWnd, SB_HORZ, x, TRUE);
        ::SetScrollPos(m_hWnd, SB_VERT, y, TRUE);
        ::ScrollWindow(m_hWnd, now.x - x, now.y - y, nullptr, nullptr);
    }
    return true;
}

void CScrollView::OnPrepareDC(CDC* pDC) {
    CPoint pos = GetScrollPosition();
    pDC->SetMapMode(MM_TEXT);
    pDC->SetViewportOrg(-pos.x, -pos.y);
}

void CScrollView::OnSize(UINT type, int cx, int cy) {
    Default();
    UpdateBars();
}

void CScrollView::OnHScroll(UINT code, UINT pos, HWND scrollBar) {
    if (scrollBar) { // a scroll bar control of our own, not the window's bar
        Default();
        return;
    }
    OnScroll(MAKEWORD(code, 0xFF), pos);
}

void CScrollView::OnVScroll(UINT code, UINT pos, HWND scrollBar) {
    if (scrollBar) {
        Default();
        return;
    }
    OnScroll(MAKEWORD(0xFF, code), pos);
}

bool CScrollView::OnMouseWheel(UINT flags, short delta, CPoint pt) {
    // Whole notches become line steps through OnScroll, so a view that keeps its own rows sees them.
    m_wheelRemainder += delta;
    while (m_wheelRemainder >= WHEEL_DELTA) {
        m_wheelRemainder -= WHEEL_DELTA;
        OnScroll(MAKEWORD(0xFF, SB_LINEUP), 0);
    }
    while (m_wheelRemainder <= -WHEEL_DELTA) {
        m_wheelRemainder += WHEEL_DELTA;
        OnScroll(MAKEWORD(0xFF, SB_LINEDOWN), 0);
    }
    return true;
}
