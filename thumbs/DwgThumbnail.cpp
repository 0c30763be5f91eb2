#include "thumbs/DwgThumbnail.h"

#include "hostapi/TextConv.h"
#include "preview/ShowPreview.h"
#include "res/resource.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DwgList.h"
#include "thumbs/RenameRules.h"
#include "thumbs/Tessel3View.h"
#include "thumbs/TooltipText.h"

namespace {

// Every redraw of the control and its label repaints at once, background included.
constexpr UINT kRedrawNow = RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW;

std::string CurrentDirectory() {
    char buffer[MAX_PATH + 1] = {};
    DWORD n = ::GetCurrentDirectoryA(sizeof buffer, buffer);
    return n > 0 && n < sizeof buffer ? std::string(buffer, n) : std::string();
}

std::string WithSlash(std::string folder) {
    if (folder.empty() || folder.back() != '\\')
        folder += '\\';
    return folder;
}

DwgData& RecordAt(int index) {
    return DwgList[index]; // outside the list: invalid-argument error, caught at the window procedure
}

// Makes the drawing the current one: the document's name, the title, the pick.
void MakeCurrent(CTessel3View& view, const std::string& name) {
    if (CTessel3Doc* doc = view.Document())
        doc->m_strName = name;
    view.SetTitle(CurrentDirectory() + "\\" + name);
    view.EnablePick(true);
    view.SetStatusText(std::string()); // a search's "no drawing starts with" is over
}

} // namespace

std::string CurrentFolder() {
    return CurrentDirectory();
}

std::string CurrentFolderWithSlash() {
    return WithSlash(CurrentDirectory());
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
    if (m_pOwner && m_pOwner->m_nListIndex >= 0 && m_pOwner->m_nListIndex < DwgList.GetSize() &&
        DwgList[m_pOwner->m_nListIndex].IsSelected())
        SetSel(0, -1);
    RedrawWindow(nullptr, nullptr, kRedrawNow);
    HWND view = ::GetParent(m_hWnd);
    if (view && ::IsWindowVisible(view))
        ::RedrawWindow(view, nullptr, nullptr, kRedrawNow | RDW_ALLCHILDREN);
}

bool CThumbLabel::Commit() {
    m_bRenaming = false;
    CTessel3View* view = m_pOwner ? m_pOwner->m_pView : nullptr;
    const CTessel3Doc* doc = view ? view->Document() : nullptr;
    std::string folder = doc ? doc->m_strPath : std::string();
    if (folder.empty())
        folder = CurrentDirectory();
    folder = WithSlash(folder);
    const std::string oldName = m_strSaved;
    const std::string newName = GetWindowText();
    const RenameVerdict verdict = CheckRename(folder, oldName, newName, [&folder](const std::string& name) {
        return ::GetFileAttributesA((folder + name).c_str()) != INVALID_FILE_ATTRIBUTES;
    });
    if (verdict != RenameVerdict::Rename) {
        // The old name comes back before the user is told why.
        SetWindowText(oldName);
        RedrawEdge();
        if (verdict != RenameVerdict::Unchanged && view)
            view->TellUser(RenameRefusalText(verdict, newName));
        return true;
    }
    // The shell renames; its loop may let the grid re-create its controls, so this label is looked at again
    // only if it still stands.
    const HWND self = m_hWnd;
    const int result = view ? view->RenameFile(folder + oldName, folder + newName) : -1;
    const bool alive = ::IsWindow(self) && CWnd::FromHandle(self) == this;
    if (result != 0) {
        if (alive) {
            SetWindowText(oldName);
            RedrawEdge();
        }
        return alive;
    }
    // The rescan rebuilds the grid, which destroys this label: it runs once this message is done.
    if (view)
        view->PostRefresh();
    if (alive)
        RedrawEdge();
    return alive;
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
                             const RECT& cell, CTessel3View* parentView, UINT id) {
    const bool created = CWnd::CreateEx(0, nullptr, windowName, style | WS_VISIBLE | WS_BORDER, cell,
                                        parentView ? parentView->Sheet() : nullptr, id);
    if (!created)
        return false;

    m_pView = parentView;
    m_nListIndex = listIndex;
    ShowWindow(SW_SHOW);
    m_strName = name;

    // The tooltip's window is made when the mouse first moves over the picture (CreateToolTip): most
    // thumbnails are scrolled past without it, and a window less for each makes the grid quicker to build.
    const DwgData& record = RecordAt(listIndex);
    const ThumbTooltip tip = BuildTooltipForTime(record.m_strName, record.m_nSize, record.m_timeWrite);
    m_strToolTip = tip.text;
    m_nToolTipWidth = tip.width;
    CreateLabel(name, cell);
    return true;
}

bool exCDwgThumbnail::Rebind(const std::string& name, int listIndex, const RECT& cell) {
    // A label being renamed keeps its edit until the control is destroyed, as before any scroll.
    if (!m_hWnd || !m_wndLabel.m_hWnd || m_wndLabel.m_bRenaming)
        return false;
    const DwgData& record = RecordAt(listIndex);
    m_nListIndex = listIndex;
    m_strName = name;
    // A tooltip of the drawing before would show its text: made again when the mouse comes.
    m_wndToolTip.DestroyWindow();
    m_bToolTipActive = false;
    const ThumbTooltip tip = BuildTooltipForTime(record.m_strName, record.m_nSize, record.m_timeWrite);
    m_strToolTip = tip.text;
    m_nToolTipWidth = tip.width;

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
    // A width of so few pixels makes the tooltip break its text at the blanks: name, size, date.
    m_wndToolTip.SetMaxTipWidth(m_nToolTipWidth);
    m_wndToolTip.AddTool(this, m_strToolTip);
    m_wndToolTip.Activate(false);
}

CRect exCDwgThumbnail::LabelRect(const RECT& cell) {
    const int cxEdge = ::GetSystemMetrics(SM_CXEDGE);
    const int cyEdge = ::GetSystemMetrics(SM_CYEDGE);
    return CRect(cell.left + cxEdge, cell.bottom + cyEdge, cell.right - cxEdge,
                 cell.bottom + CTessel3View::LabelHeight() - cyEdge);
}

bool exCDwgThumbnail::CreateLabel(const std::string& name, const RECT& cell) {
    const CRect rc = LabelRect(cell);
    m_wndLabel.m_pOwner = this;
    if (!m_wndLabel.CreateEx(0, "EDIT", "", WS_CHILD | ES_READONLY | ES_NOHIDESEL | ES_AUTOHSCROLL, rc,
                             m_pView ? m_pView->Sheet() : nullptr, 0))
        return false;
    m_wndLabel.SetWindowText(name);
    if (RecordAt(m_nListIndex).IsSelected())
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
    m_pView = nullptr;
    return CWnd::DestroyWindow();
}

void exCDwgThumbnail::OnPaint() {
    CPaintDC dc(m_hWnd);
    // The bare name: the host resolves it against the current directory, which the scan set.
    const std::wstring wide = WidenAnsi(m_strName);
    const std::uint32_t background = 0;
    ShowDwgPreview(m_hWnd, wide.c_str(), background);
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

void exCDwgThumbnail::Unselect() {
    DropLabelHighlight();
    RecordAt(m_nListIndex).Deselect();
}

void exCDwgThumbnail::ShowSelection() {
    if (m_nListIndex >= 0 && m_nListIndex < DwgList.GetSize() && DwgList[m_nListIndex].IsSelected())
        HighlightLabel();
}

void exCDwgThumbnail::SelectThis(bool clearOthers) {
    if (clearOthers) {
        if (m_pView)
            m_pView->DeselectAll();
        else
            DeselectAllFlags();
    }
    DwgData& record = RecordAt(m_nListIndex);
    HighlightLabel();
    record.Select();
    if (m_pView)
        MakeCurrent(*m_pView, record.m_strName);
}

void exCDwgThumbnail::ToggleSelection() {
    SetFocus();
    DwgData& record = RecordAt(m_nListIndex);
    if (record.IsSelected()) {
        DropLabelHighlight();
        record.Deselect();
        if (m_pView) {
            m_pView->EnablePick(false);
            if (CTessel3Doc* doc = m_pView->Document())
                doc->m_strName.clear();
            m_pView->SetTitle(CurrentDirectory());
        }
    } else {
        HighlightLabel();
        record.Select();
        if (m_pView)
            MakeCurrent(*m_pView, record.m_strName);
    }
}

void exCDwgThumbnail::Pick() {
    const DwgData& record = RecordAt(m_nListIndex);
    if (CTessel3Doc* doc = m_pView ? m_pView->Document() : nullptr) {
        doc->m_strName = record.m_strName;
        doc->m_strPath = CurrentFolderWithSlash();
    }
    PostAppResult(kAppAccept);
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
        // A click in the grid takes the keyboard there (from the folder tree, the search edit).
        if (HWND view = m_pView ? m_pView->m_hWnd : nullptr) {
            HWND focus = ::GetFocus();
            if (focus != view && !::IsChild(view, focus))
                ::SetFocus(view);
        }
        if (pMsg->wParam == MK_LBUTTON) {
            SelectThis(true);
            RedrawWindow(nullptr, nullptr, kRedrawNow);
        } else if (pMsg->wParam == (MK_LBUTTON | MK_CONTROL)) {
            ToggleSelection();
        }
        return false;
    case WM_LBUTTONDBLCLK:
        Pick();
        return true;
    case WM_RBUTTONDOWN: {
        SelectThis(false);
        CPoint pt(pMsg->lParam);
        ClientToScreen(&pt);
        ShowContextMenu(pt);
        return true;
    }
    case WM_KEYDOWN:
        // Keyboard navigation belongs to the grid.
        if (HWND view = m_pView ? m_pView->m_hWnd : nullptr) {
            ::SetFocus(view);
            ::PostMessageA(view, WM_KEYDOWN, pMsg->wParam, pMsg->lParam);
        }
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

void exCDwgThumbnail::ShowContextMenu(POINT screenPoint) {
    CMenu menu;
    CMenu popup = BuildThumbnailMenu(menu, m_pView ? m_pView->SortMode() : 0,
                                     m_pView && m_pView->ClipboardHoldsDrawings());
    if (!popup.m_hMenu)
        return;
    HWND self = m_hWnd;
    const int command = popup.TrackPopupMenu(TPM_RETURNCMD | TPM_RIGHTBUTTON | TPM_NONOTIFY, screenPoint.x,
                                             screenPoint.y, self);
    // The menu's own loop may have let the grid re-create its controls: act only if this one still stands.
    if (!::IsWindow(self) || CWnd::FromHandle(self) != this)
        return;
    OnContextCommand(command);
}

void exCDwgThumbnail::OnContextCommand(int command) {
    switch (command) {
    case ID_SORT_NAME:
    case ID_SORT_DATE:
    case ID_SORT_SIZE:
        // The sort belongs to the window the grid lives in.
        if (HWND frame = ::GetAncestor(m_hWnd, GA_ROOT); frame && frame != m_hWnd)
            ::PostMessageA(frame, WM_COMMAND, static_cast<WPARAM>(command), 0);
        break;
    // The file commands run the shell's loops: nothing of this control is touched after them.
    case ID_THUMB_COPY:
        if (m_pView)
            m_pView->CopySelection(false);
        break;
    case ID_THUMB_DELETE:
        if (m_pView)
            m_pView->DeleteSelection();
        break;
    case ID_THUMB_PASTE:
        if (m_pView)
            m_pView->PasteFiles();
        break;
    case ID_THUMB_RENAME:
        m_wndLabel.BeginRename();
        break;
    case ID_THUMB_PROPERTY:
        ShowProperties();
        break;
    default:
        break;
    }
}

void exCDwgThumbnail::ShowProperties() {
    // The full path: the property sheet does not depend on the current directory.
    if (m_pView)
        m_pView->ShowProperties(CurrentFolderWithSlash() + RecordAt(m_nListIndex).m_strName);
}
