#include "thumbs/DwgThumbnail.h"

#include "hostapi/TextConv.h"
#include "preview/PictureLoader.h"
#include "preview/ShowPreview.h"
#include "res/resource.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/GridMath.h"
#include "thumbs/TooltipText.h"

#include <algorithm>

namespace {

// Every redraw of the control and its label repaints at once, background included.
constexpr UINT kRedrawNow = RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW;

// The widest text a tooltip over the window may hold: its monitor's work area less the tooltip's margins
// and border, with room to spare (64 pixels).
int ScreenTextWidth(HWND window) {
    MONITORINFO monitor{};
    monitor.cbSize = sizeof monitor;
    if (!::GetMonitorInfoW(::MonitorFromWindow(window, MONITOR_DEFAULTTONEAREST), &monitor))
        return ::GetSystemMetrics(SM_CXSCREEN) - 64;
    return static_cast<int>(monitor.rcWork.right - monitor.rcWork.left) - 64;
}

} // namespace

int ThumbnailLabelHeight() {
    static const int height = [] {
        CClientDC dc(nullptr);
        TEXTMETRICA tm{};
        dc.GetTextMetrics(&tm);
        return grid::LabelHeight(tm.tmHeight, ::GetSystemMetrics(SM_CYEDGE));
    }();
    return height;
}

PictureKey DrawingPictureKey(const DrawingFolder& folder, int index, int width, int height) {
    PictureKey key;
    if (index < 0 || index >= folder.Count())
        return key;
    const DwgData& record = folder.Drawing(index);
    key.path = folder.PathOf(index);
    key.fileSize = record.m_nSize;
    key.writeTime = record.m_timeWrite;
    key.width = width;
    key.height = height;
    key.background = kThumbnailBackground;
    return key;
}

// ---- the label --------------------------------------------------------------------------------------

void CThumbLabel::BeginRename() {
    if (!m_hWnd)
        return;
    SetFocus();
    SetReadOnly(false);
    m_strSaved = GetWindowText();
    m_bRenaming = true;
    SetSel(0, -1);
    RedrawWindow(nullptr, nullptr, kRedrawNow);
    RedrawEdge();
}

CRect CThumbLabel::EdgeRect() const {
    CRect rc = GetClientRect();
    ::MapWindowPoints(m_hWnd, ::GetParent(m_hWnd), reinterpret_cast<POINT*>(&rc), 2);
    rc.InflateRect(2, 2);
    return rc;
}

void CThumbLabel::RedrawEdge() {
    // The edge lies outside the label, on the grid view, which draws it while the label renames.
    HWND parent = ::GetParent(m_hWnd);
    if (!parent)
        return;
    CRect rc = EdgeRect();
    rc.InflateRect(1, 1);
    ::RedrawWindow(parent, &rc, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
}

bool CThumbLabel::PreTranslateMessage(MSG* pMsg) {
    // While renaming, keys are the edit's own: the grid's navigation and the frame's accelerators (Delete,
    // Ctrl+C...) must not take them.
    if (m_bRenaming && pMsg->hwnd == m_hWnd && pMsg->message >= WM_KEYFIRST && pMsg->message <= WM_KEYLAST) {
        ::TranslateMessage(pMsg);
        ::DispatchMessageA(pMsg);
        return true;
    }
    return false;
}

void CThumbLabel::OnReturn() {
    if (m_bRenaming && !Commit())
        return; // the grid has re-created its controls meanwhile
    m_strSaved = GetWindowText();
    SetReadOnly(true);
}

void CThumbLabel::OnEscape() {
    m_bRenaming = false;
    SetWindowText(m_strSaved);
    SetReadOnly(true);
    RedrawWindow(nullptr, nullptr, kRedrawNow);
    RedrawEdge();
}

void CThumbLabel::OnLeave() {
    m_bRenaming = false;
    if (!m_strSaved.empty())
        SetWindowText(m_strSaved);
    SetReadOnly(true);
    // Setting the text drops the highlight; a selected drawing keeps it.
    if (m_pOwner && m_pOwner->IsDrawingSelected())
        SetSel(0, -1);
    RedrawWindow(nullptr, nullptr, kRedrawNow);
    HWND view = ::GetParent(m_hWnd);
    if (view && ::IsWindowVisible(view))
        ::RedrawWindow(view, nullptr, nullptr, kRedrawNow | RDW_ALLCHILDREN);
}

bool CThumbLabel::Commit() {
    m_bRenaming = false;
    ThumbnailOwner* owner = m_pOwner ? m_pOwner->m_pOwner : nullptr;
    const std::string oldName = m_strSaved;
    const std::string newName = GetWindowText();
    // The owner may run the shell's rename, whose loop may let the grid re-create its controls: this
    // label is looked at again only if it still stands.
    const HWND self = m_hWnd;
    const ThumbnailOwner::RenameOutcome outcome =
        owner ? owner->OnThumbnailRename(oldName, newName) : ThumbnailOwner::RenameOutcome::Refused;
    const bool alive = ::IsWindow(self) && CWnd::FromHandle(self) == this;
    if (alive) {
        if (outcome != ThumbnailOwner::RenameOutcome::Renamed)
            SetWindowText(oldName);
        RedrawEdge();
    }
    return alive;
}

LRESULT CThumbLabel::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    if (m_bRenaming)
        return CEdit::WindowProc(message, wParam, lParam); // the edit's own drawing, caret and scrolling
    switch (message) {
    case WM_PAINT: {
        PAINTSTRUCT paint{};
        HDC dc = ::BeginPaint(m_hWnd, &paint);
        if (dc)
            Draw(dc);
        ::EndPaint(m_hWnd, &paint);
        return 0;
    }
    case WM_PRINTCLIENT:
        Draw(reinterpret_cast<HDC>(wParam));
        return 0;
    case WM_ERASEBKGND:
        return 1; // Draw fills the whole label
    default:
        return CEdit::WindowProc(message, wParam, lParam);
    }
}

namespace {

// The label's font (none: the DC keeps its own).
HGDIOBJ LabelFontOf(HWND label) {
    return reinterpret_cast<HGDIOBJ>(::SendMessageW(label, WM_GETFONT, 0, 0));
}

int TextWidth(HDC dc, const std::wstring& text) {
    SIZE size{};
    ::GetTextExtentPoint32W(dc, text.c_str(), static_cast<int>(text.size()), &size);
    return static_cast<int>(size.cx);
}

} // namespace

CRect CThumbLabel::TextRect() const {
    const DWORD margins = static_cast<DWORD>(::SendMessageW(m_hWnd, EM_GETMARGINS, 0, 0));
    CRect area = GetClientRect();
    area.left += LOWORD(margins);
    area.right -= HIWORD(margins);
    return area;
}

std::wstring CThumbLabel::ShownText(HDC dc) const {
    const int length = ::GetWindowTextLengthW(m_hWnd);
    std::wstring text(static_cast<std::size_t>(length) + 1, L'\0');
    text.resize(static_cast<std::size_t>(::GetWindowTextW(m_hWnd, text.data(), length + 1)));
    const int room = TextRect().Width();
    const CSelectObject font(dc, LabelFontOf(m_hWnd));
    if (TextWidth(dc, text) <= room)
        return text;
    // The longest start of the name that fits with the ellipsis after it.
    static const std::wstring kEllipsis = L"...";
    std::size_t low = 0, high = text.size();
    while (low < high) {
        const std::size_t mid = (low + high + 1) / 2;
        if (TextWidth(dc, text.substr(0, mid) + kEllipsis) <= room)
            low = mid;
        else
            high = mid - 1;
    }
    if (low > 0 && low < text.size() && IS_HIGH_SURROGATE(text[low - 1]))
        --low; // never half a character
    return text.substr(0, low) + kEllipsis;
}

void CThumbLabel::Draw(HDC dc) {
    const CRect client = GetClientRect();
    HWND parent = ::GetParent(m_hWnd);
    // The colours of a read-only edit: its parent's answer to WM_CTLCOLORSTATIC, as the edit asks.
    auto brush = reinterpret_cast<HBRUSH>(::SendMessageW(
        parent, WM_CTLCOLORSTATIC, reinterpret_cast<WPARAM>(dc), reinterpret_cast<LPARAM>(m_hWnd)));
    if (!brush)
        brush = ::GetSysColorBrush(COLOR_3DFACE);
    ::FillRect(dc, &client, brush);
    const std::wstring shown = ShownText(dc);
    CRect text = TextRect();
    const CSelectObject font(dc, LabelFontOf(m_hWnd));
    int start = 0, end = 0;
    GetSel(start, end);
    const bool selected = start == 0 && end > 0 && end >= ::GetWindowTextLengthW(m_hWnd);
    if (selected) {
        // The highlight covers the text shown, as an edit's selection does.
        const CRect marked(text.left, client.top,
                           std::min<LONG>(text.left + TextWidth(dc, shown), text.right), client.bottom);
        ::FillRect(dc, &marked, ::GetSysColorBrush(COLOR_HIGHLIGHT));
        ::SetTextColor(dc, ::GetSysColor(COLOR_HIGHLIGHTTEXT));
    }
    ::SetBkMode(dc, TRANSPARENT);
    ::DrawTextW(dc, shown.c_str(), static_cast<int>(shown.size()), &text,
                DT_SINGLELINE | DT_NOPREFIX | DT_LEFT);
}

void CThumbLabel::OnLButtonDblClk(UINT, CPoint) {
    BeginRename();
}

void CThumbLabel::OnKeyDown(UINT nChar, UINT, UINT) {
    if (nChar == VK_RETURN)
        OnReturn();
    else if (nChar == VK_ESCAPE)
        OnEscape();
    else
        Default();
}

void CThumbLabel::OnChar(UINT nChar, UINT, UINT) {
    if (nChar != '\r' && nChar != VK_ESCAPE) // those are handled on key down; no beep
        Default();
}

void CThumbLabel::OnKillFocus(HWND) {
    Default();
    OnLeave();
}

// ---- the thumbnail ----------------------------------------------------------------------------------

exCDwgThumbnail::~exCDwgThumbnail() {
    DestroyWindow();
}

bool exCDwgThumbnail::Create(const std::string& name, int listIndex, const char* windowName, DWORD style,
                             const RECT& cell, CWnd* parent, ThumbnailOwner* owner, UINT id) {
    const bool created =
        CWnd::CreateEx(0, nullptr, windowName, style | WS_VISIBLE | WS_BORDER, cell, parent, id);
    if (!created)
        return false;

    m_pOwner = owner;
    m_nListIndex = listIndex;
    ShowWindow(SW_SHOW);
    m_strName = name;

    // The tooltip's window is made when the mouse first moves over the picture (CreateToolTip): most
    // thumbnails are scrolled past without it, and a window less for each makes the grid quicker to build.
    if (m_pOwner) {
        const DwgData& record = m_pOwner->Folder().Drawing(listIndex);
        const ThumbTooltip tip = BuildTooltipForTime(record.m_strName, record.m_nSize, record.m_timeWrite);
        m_strToolTip = tip.text;
        m_toolTip = tip;
    }
    CreateLabel(name, cell, parent);
    return true;
}

bool exCDwgThumbnail::Rebind(const std::string& name, int listIndex, const RECT& cell) {
    // A label being renamed keeps its edit until the control is destroyed, as before any scroll.
    if (!m_hWnd || !m_wndLabel.m_hWnd || m_wndLabel.m_bRenaming || !m_pOwner)
        return false;
    const DwgData& record = m_pOwner->Folder().Drawing(listIndex);
    m_nListIndex = listIndex;
    m_strName = name;
    // A tooltip of the drawing before would show its text: made again when the mouse comes.
    m_wndToolTip.DestroyWindow();
    m_bToolTipActive = false;
    const ThumbTooltip tip = BuildTooltipForTime(record.m_strName, record.m_nSize, record.m_timeWrite);
    m_strToolTip = tip.text;
    m_toolTip = tip;

    constexpr UINT kMove = SWP_NOZORDER | SWP_NOACTIVATE | SWP_NOCOPYBITS;
    const CRect rc(cell);
    ::SetWindowPos(m_hWnd, nullptr, rc.left, rc.top, rc.Width(), rc.Height(), kMove);
    ::InvalidateRect(m_hWnd, nullptr, TRUE);
    const CRect label = LabelRect(cell);
    ::SetWindowPos(m_wndLabel.m_hWnd, nullptr, label.left, label.top, label.Width(), label.Height(), kMove);
    m_wndLabel.SetWindowText(name); // drops any highlight of the drawing before
    if (record.IsSelected())
        HighlightLabel();
    ::InvalidateRect(m_wndLabel.m_hWnd, nullptr, TRUE);
    return true;
}

void exCDwgThumbnail::CreateToolTip() {
    if (m_wndToolTip.m_hWnd || !m_wndToolTip.Create(this, 0))
        return;
    // As wide as its widest line in its own font, and no wider than the screen it shows on: a name wider
    // than that (255 wide letters) is cut into lines.
    const auto measure = [this](const std::string& text) {
        CClientDC dc(m_wndToolTip.m_hWnd);
        const CSelectObject font(dc.GetSafeHdc(),
                                 reinterpret_cast<HGDIOBJ>(m_wndToolTip.SendMessage(WM_GETFONT)));
        // Measured as the tooltip draws it: in Unicode, converted from the ANSI code page (the A function
        // would read the bytes in the font's own code page).
        const std::wstring wide = WidenAnsi(text);
        SIZE size{};
        ::GetTextExtentPoint32W(dc.GetSafeHdc(), wide.c_str(), static_cast<int>(wide.size()), &size);
        return static_cast<int>(size.cx);
    };
    const int width = TooltipWidthFor(m_toolTip, ScreenTextWidth(m_hWnd), measure);
    m_wndToolTip.SetMaxTipWidth(width);
    m_wndToolTip.AddTool(this, TooltipShownText(m_toolTip, width, measure));
    m_wndToolTip.Activate(false);
}

CRect exCDwgThumbnail::LabelRect(const RECT& cell) {
    const int cxEdge = ::GetSystemMetrics(SM_CXEDGE);
    const int cyEdge = ::GetSystemMetrics(SM_CYEDGE);
    return CRect(cell.left + cxEdge, cell.bottom + cyEdge, cell.right - cxEdge,
                 cell.bottom + ThumbnailLabelHeight() - cyEdge);
}

bool exCDwgThumbnail::CreateLabel(const std::string& name, const RECT& cell, CWnd* parent) {
    const CRect rc = LabelRect(cell);
    m_wndLabel.m_pOwner = this;
    if (!m_wndLabel.CreateEx(0, "EDIT", "", WS_CHILD | ES_READONLY | ES_NOHIDESEL | ES_AUTOHSCROLL, rc,
                             parent, 0))
        return false;
    m_wndLabel.SetWindowText(name);
    if (IsDrawingSelected())
        HighlightLabel();
    m_wndLabel.ShowWindow(SW_SHOW);
    m_wndLabel.RedrawWindow(nullptr, nullptr, kRedrawNow);
    return true;
}

bool exCDwgThumbnail::DestroyWindow() {
    m_wndLabel.m_bRenaming = false;
    m_wndLabel.DestroyWindow();
    m_wndLabel.m_pOwner = nullptr;
    m_wndToolTip.DestroyWindow();
    m_bToolTipActive = false;
    m_pOwner = nullptr;
    return CWnd::DestroyWindow();
}

void exCDwgThumbnail::OnPaint() {
    CPaintDC dc(m_hWnd);
    PictureLoader* pictures = m_pOwner ? m_pOwner->Pictures() : nullptr;
    const Picture* picture = nullptr;
    PictureKey key;
    if (pictures) {
        const CRect client = GetClientRect();
        key = DrawingPictureKey(m_pOwner->Folder(), m_nListIndex, client.Width(), client.Height());
        picture = pictures->Find(key);
        if (picture && picture->state != PictureState::HostDraws && PaintPicture(dc.GetSafeHdc(), *picture))
            return;
        if (!picture) {
            // Read by the loader's workers; this control repaints when the picture arrives.
            PaintLoading(dc.GetSafeHdc(), client, static_cast<COLORREF>(kThumbnailBackground));
            if (!pictures->Knows(key))
                m_pOwner->OnThumbnailPictureMissing();
            return;
        }
    }
    // No loader, or a picture only the host can draw: the host's operation, on this thread. The bare
    // name: the host resolves it against the current directory, which the scan set.
    const std::wstring wide = WidenAnsi(m_strName);
    ShowDwgPreview(m_hWnd, wide.c_str(), kThumbnailBackground);
}

LRESULT exCDwgThumbnail::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_PAINT:
        OnPaint();
        return 0;
    default:
        return CWnd::WindowProc(message, wParam, lParam);
    }
}

void exCDwgThumbnail::HighlightLabel() {
    if (m_wndLabel.m_hWnd)
        m_wndLabel.SetSel(0, -1);
}

void exCDwgThumbnail::DropLabelHighlight() {
    if (!m_wndLabel.m_hWnd)
        return;
    m_wndLabel.Clear();
    // Setting the text again drops the selection.
    m_wndLabel.SetWindowText(m_wndLabel.GetWindowText());
}

bool exCDwgThumbnail::IsDrawingSelected() const {
    return m_pOwner && m_pOwner->Folder().IsSelected(m_nListIndex);
}

void exCDwgThumbnail::ShowSelection() {
    if (IsDrawingSelected())
        HighlightLabel();
    else
        DropLabelHighlight();
}

bool exCDwgThumbnail::PreTranslateMessage(MSG* pMsg) {
    if (!m_hWnd)
        return false;
    // Called from message loops, outside any window procedure: nothing may escape from here.
    try {
        return TranslateInput(pMsg);
    } catch (...) {
        AfxReportCurrentException();
        return true;
    }
}

bool exCDwgThumbnail::TranslateInput(MSG* pMsg) {
    switch (pMsg->message) {
    case WM_MOUSEMOVE:
        // Created inactive when the mouse first moves over the picture, the tooltip starts to work then;
        // from then on the control's own delays decide when it shows.
        CreateToolTip();
        if (m_wndToolTip.m_hWnd && !m_bToolTipActive) {
            m_wndToolTip.Activate(true);
            m_bToolTipActive = true;
        }
        if (m_wndToolTip.m_hWnd)
            m_wndToolTip.RelayEvent(pMsg);
        return false;
    case WM_LBUTTONUP:
        if (m_wndToolTip.m_hWnd)
            m_wndToolTip.RelayEvent(pMsg);
        return false;
    case WM_LBUTTONDOWN:
        if (m_wndToolTip.m_hWnd)
            m_wndToolTip.RelayEvent(pMsg);
        if (m_pOwner) {
            const HWND self = m_hWnd;
            m_pOwner->OnThumbnailMouseDown();
            if (pMsg->wParam == MK_LBUTTON || pMsg->wParam == (MK_LBUTTON | MK_CONTROL))
                m_pOwner->OnThumbnailClick(m_nListIndex, pMsg->wParam != MK_LBUTTON);
            if (pMsg->wParam == MK_LBUTTON && ::IsWindow(self))
                RedrawWindow(nullptr, nullptr, kRedrawNow);
        }
        return false;
    case WM_LBUTTONDBLCLK:
        if (m_pOwner)
            m_pOwner->OnThumbnailPick(m_nListIndex);
        return true;
    case WM_RBUTTONDOWN: {
        CPoint pt(pMsg->lParam);
        ClientToScreen(&pt);
        // The menu's loop may let the grid re-create its controls: nothing of this one is touched after.
        if (m_pOwner)
            m_pOwner->OnThumbnailMenu(m_nListIndex, pt);
        return true;
    }
    case WM_KEYDOWN:
        if (m_pOwner)
            m_pOwner->OnThumbnailKey(pMsg->wParam, pMsg->lParam);
        return true;
    default:
        return false;
    }
}

CMenu BuildThumbnailMenu(CMenu& menu, int sortMode, bool canPaste) {
    CMenu popup;
    if (!menu.LoadMenu(IDR_THUMB_MENU))
        return popup;
    popup = menu.GetSubMenu(0);
    if (!popup.m_hMenu)
        return popup;
    // Only a file list that names a drawing is offered for pasting.
    if (!canPaste)
        popup.EnableMenuItem(ID_THUMB_PASTE, MF_BYCOMMAND | MF_GRAYED);
    static const UINT kSortIds[] = {ID_SORT_NAME, ID_SORT_DATE, ID_SORT_SIZE};
    if (sortMode >= 0 && sortMode < 3)
        popup.CheckMenuItem(kSortIds[sortMode], MF_BYCOMMAND | MF_CHECKED);
    return popup;
}
