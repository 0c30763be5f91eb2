#include "afxframe.h"
#include "afxview.h"

#include <algorithm>
#include <cstring>

namespace {

// Copies a tooltip text into a notification's own buffer.
template <size_t N> void CopyTip(char (&buffer)[N], const std::string& text) {
    ::lstrcpynA(buffer, text.c_str(), static_cast<int>(N));
}

template <size_t N> void CopyTip(wchar_t (&buffer)[N], const std::string& text) {
    int n = ::MultiByteToWideChar(CP_ACP, 0, text.c_str(), -1, buffer, static_cast<int>(N));
    if (n == 0)
        buffer[0] = L'\0';
    buffer[N - 1] = L'\0';
}

template <class NMTTDISPINFO_T> void FillTip(NMTTDISPINFO_T* info, const std::string& text) {
    info->lpszText = info->szText;
    info->hinst = nullptr;
    CopyTip(info->szText, text);
}

} // namespace

CFrameWnd* AfxGetParentFrame(const CWnd* wnd) {
    if (!wnd || !wnd->m_hWnd)
        return nullptr;
    for (HWND h = ::GetParent(wnd->m_hWnd); h; h = ::GetParent(h)) {
        if (auto* frame = dynamic_cast<CFrameWnd*>(CWnd::FromHandle(h)))
            return frame;
        if (!(::GetWindowLongPtrA(h, GWL_STYLE) & WS_CHILD))
            break;
    }
    return nullptr;
}

CFrameWnd::~CFrameWnd() = default;

bool CFrameWnd::LoadFrame(UINT resourceId, DWORD style, CWnd* parent, CCreateContext* context) {
    HINSTANCE hInst = AfxGetResourceHandle();
    m_nIDResource = resourceId;
    m_dwFrameStyle = style & FWS_ADDTOTITLE;
    style &= ~FWS_ADDTOTITLE;

    std::string title = CWinApp::LoadString(resourceId);
    m_strTitle = title.substr(0, title.find('\n'));
    if (m_strTitle.empty())
        m_strTitle = "Untitled";
    m_hIcon = ::LoadIconA(hInst, MAKEINTRESOURCEA(resourceId));
    m_hIconSmall = static_cast<HICON>(
        ::LoadImageA(hInst, MAKEINTRESOURCEA(resourceId), IMAGE_ICON, ::GetSystemMetrics(SM_CXSMICON),
                     ::GetSystemMetrics(SM_CYSMICON), LR_DEFAULTCOLOR | LR_SHARED));
    // The menu is this call's until a window is made with it, then the window's.
    const HMENU menu = ::LoadMenuA(hInst, MAKEINTRESOURCEA(resourceId));
    m_hMenuDefault = menu;
    m_hAccelTable = ::LoadAcceleratorsA(hInst, MAKEINTRESOURCEA(resourceId));
    m_pContext = context;

    // A creation that fails in WM_CREATE destroys the window, and with it a frame that deletes itself:
    // after it, this object is touched only when the watch says it is still there.
    const LifetimeWatch watch(*this);
    // An empty rectangle: the system's default placement (PreCreateWindow).
    const bool ok = CreateEx(0, nullptr, m_strTitle.c_str(), style, CRect(), parent, 0);
    if (!ok) {
        // No window owns the menu: either none was made, or the one destroyed in its creation took it
        // along (then the handle is no menu any more).
        if (menu && ::IsMenu(menu))
            ::DestroyMenu(menu);
        if (!watch.Gone()) {
            m_hMenuDefault = nullptr;
            m_pContext = nullptr;
        }
        return false;
    }
    m_pContext = nullptr;
    if (m_hIcon)
        SendMessage(WM_SETICON, ICON_BIG, reinterpret_cast<LPARAM>(m_hIcon));
    if (m_hIconSmall)
        SendMessage(WM_SETICON, ICON_SMALL, reinterpret_cast<LPARAM>(m_hIconSmall));
    OnUpdateFrameTitle(true);
    return true;
}

bool CFrameWnd::PreCreateWindow(CREATESTRUCTA& cs) {
    if (!(cs.style & WS_CHILD)) {
        cs.hMenu = m_hMenuDefault;
        if (cs.x == 0 && cs.y == 0 && cs.cx == 0 && cs.cy == 0)
            cs.x = cs.y = cs.cx = cs.cy = static_cast<int>(CW_USEDEFAULT);
    }
    if (!cs.lpszClass)
        cs.lpszClass = AfxRegisterWndClass(CS_DBLCLKS, ::LoadCursorA(nullptr, IDC_ARROW),
                                           reinterpret_cast<HBRUSH>(COLOR_BTNFACE + 1), nullptr);
    return true;
}

int CFrameWnd::OnCreate(LPCREATESTRUCTA cs) {
    if (CWnd::OnCreate(cs) == -1)
        return -1;
    if (!OnCreateClient(cs, m_pContext))
        return -1;
    return 0;
}

bool CFrameWnd::OnCreateClient(LPCREATESTRUCTA, CCreateContext* context) {
    if (!context || !context->m_pNewView)
        return true;
    CView* view = context->m_pNewView();
    if (!view)
        return false;
    return view->Create(nullptr, nullptr, WS_CHILD | WS_VISIBLE, CRect(), this, AFX_IDW_PANE_FIRST, context);
}

void CFrameWnd::AddControlBar(CControlBar* bar) {
    if (std::find(m_bars.begin(), m_bars.end(), bar) == m_bars.end())
        m_bars.push_back(bar);
}

void CFrameWnd::RemoveControlBar(CControlBar* bar) {
    m_bars.erase(std::remove(m_bars.begin(), m_bars.end(), bar), m_bars.end());
}

CControlBar* CFrameWnd::GetControlBar(UINT id) const {
    // The status bar id means the status bar, whatever else was given its id.
    for (CControlBar* bar : m_bars)
        if (bar->m_hWnd && static_cast<UINT>(bar->GetDlgCtrlID()) == id &&
            (id != AFX_IDW_STATUS_BAR || dynamic_cast<CStatusBar*>(bar)))
            return bar;
    return nullptr;
}

void CFrameWnd::ShowControlBar(CControlBar* bar, bool show, bool delay) {
    if (!bar || !bar->m_hWnd)
        return;
    bar->ShowWindow(show ? SW_SHOWNOACTIVATE : SW_HIDE);
    if (!delay)
        RecalcLayout();
}

void CFrameWnd::RecalcLayout() {
    if (!m_hWnd || m_bInRecalc)
        return;
    m_bInRecalc = true;
    CRect rest = GetClientRect();
    const int width = rest.Width();
    // Bars that are gone (destroyed before the frame) are forgotten here.
    m_bars.erase(std::remove_if(m_bars.begin(), m_bars.end(), [](CControlBar* b) { return !b->m_hWnd; }),
                 m_bars.end());
    // The status bar sits lowest, then bottom bars upwards in creation order, top bars downwards.
    std::vector<CControlBar*> order;
    for (CControlBar* bar : m_bars)
        if (dynamic_cast<CStatusBar*>(bar))
            order.push_back(bar);
    for (CControlBar* bar : m_bars)
        if (!dynamic_cast<CStatusBar*>(bar))
            order.push_back(bar);
    HDWP dwp = ::BeginDeferWindowPos(static_cast<int>(order.size()) + 1);
    for (CControlBar* bar : order) {
        if (!bar->IsWindowVisible())
            continue;
        int height = bar->CalcHeight(width);
        CRect rc;
        if (bar->GetBarStyle() & CBRS_ALIGN_BOTTOM || dynamic_cast<CStatusBar*>(bar)) {
            rc = CRect(rest.left, rest.bottom - height, rest.right, rest.bottom);
            rest.bottom -= height;
        } else {
            rc = CRect(rest.left, rest.top, rest.right, rest.top + height);
            rest.top += height;
        }
        dwp = ::DeferWindowPos(dwp, bar->m_hWnd, nullptr, rc.left, rc.top, rc.Width(), rc.Height(),
                               SWP_NOZORDER | SWP_NOACTIVATE);
    }
    if (HWND pane = ::GetDlgItem(m_hWnd, AFX_IDW_PANE_FIRST)) {
        if (rest.bottom < rest.top)
            rest.bottom = rest.top;
        dwp = ::DeferWindowPos(dwp, pane, nullptr, rest.left, rest.top, rest.Width(), rest.Height(),
                               SWP_NOZORDER | SWP_NOACTIVATE);
    }
    ::EndDeferWindowPos(dwp);
    m_bInRecalc = false;
}

void CFrameWnd::OnSize(UINT type, int cx, int cy) {
    Default();
    if (type != SIZE_MINIMIZED)
        RecalcLayout();
}

void CFrameWnd::OnSetFocus(HWND oldWnd) {
    // The keyboard goes on to the active view.
    if (m_pActiveView && m_pActiveView->m_hWnd)
        m_pActiveView->SetFocus();
    else
        Default();
}

void CFrameWnd::SetActiveView(CView* view, bool notify) {
    CView* old = m_pActiveView;
    if (view == old)
        return;
    m_pActiveView = view;
    if (old && old->m_hWnd)
        old->OnActivateView(false, view, old);
    if (view && view->m_hWnd) {
        view->OnActivateView(true, view, old);
        if (notify && ::GetFocus() != view->m_hWnd && !::IsChild(view->m_hWnd, ::GetFocus()))
            view->SetFocus();
    }
}

CDocument* CFrameWnd::GetActiveDocument() const {
    if (m_pActiveView && m_pActiveView->GetDocument())
        return m_pActiveView->GetDocument();
    return m_pDocument;
}

namespace {

BOOL CALLBACK SendInitialUpdate(HWND hwnd, LPARAM) {
    if (auto* view = dynamic_cast<CView*>(CWnd::FromHandle(hwnd)))
        view->OnInitialUpdate();
    return TRUE;
}

} // namespace

void CFrameWnd::InitialUpdateFrame(CDocument* doc, bool makeVisible) {
    m_pDocument = doc;
    if (!m_pActiveView) {
        HWND pane = ::GetDlgItem(m_hWnd, AFX_IDW_PANE_FIRST);
        // A splitter: its first pane is the first view.
        if (pane && !dynamic_cast<CView*>(FromHandle(pane)))
            pane = ::GetDlgItem(pane, AFX_IDW_PANE_FIRST);
        if (auto* view = dynamic_cast<CView*>(FromHandle(pane)))
            SetActiveView(view, false);
    }
    ::EnumChildWindows(m_hWnd, SendInitialUpdate, 0);
    OnUpdateFrameTitle(true);
    RecalcLayout();
    if (makeVisible) {
        ShowWindow(SW_SHOW);
        UpdateWindow();
    }
}

void CFrameWnd::OnUpdateFrameTitle(bool addToTitle) {
    if (!m_hWnd)
        return;
    std::string text = m_strTitle;
    if (addToTitle && (m_dwFrameStyle & FWS_ADDTOTITLE)) {
        if (CDocument* doc = GetActiveDocument()) {
            std::string docTitle = doc->GetTitle().empty() ? "Untitled" : doc->GetTitle();
            text = m_strTitle.empty() ? docTitle : docTitle + " - " + m_strTitle;
        }
    }
    if (GetWindowText() != text)
        SetWindowText(text);
}

std::string CFrameWnd::GetMessageString(UINT id) const {
    std::string s = CWinApp::LoadString(id);
    return s.substr(0, s.find('\n'));
}

std::string CFrameWnd::GetIdleMessage() const {
    std::string s = CWinApp::LoadString(AFX_IDS_IDLEMESSAGE);
    return s.empty() ? "Ready" : s;
}

void CFrameWnd::SetMessageText(const std::string& text) {
    if (auto* bar = dynamic_cast<CStatusBar*>(GetControlBar(AFX_IDW_STATUS_BAR)))
        bar->SetPaneText(0, text);
}

bool CFrameWnd::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message >= WM_KEYFIRST && pMsg->message <= WM_KEYLAST && m_hAccelTable &&
        ::TranslateAcceleratorA(m_hWnd, m_hAccelTable, pMsg))
        return true;
    return CWnd::PreTranslateMessage(pMsg);
}

bool CFrameWnd::OnCmdMsg(UINT id, int code) {
    if (m_pActiveView && m_pActiveView->m_hWnd && m_pActiveView->OnCmdMsg(id, code))
        return true;
    switch (id) {
    case ID_APP_EXIT:
        PostMessage(WM_CLOSE);
        return true;
    case ID_VIEW_TOOLBAR:
    case ID_VIEW_STATUS_BAR:
        if (CControlBar* bar = GetControlBar(id == ID_VIEW_TOOLBAR ? AFX_IDW_TOOLBAR : AFX_IDW_STATUS_BAR)) {
            ShowControlBar(bar, !bar->IsWindowVisible());
            return true;
        }
        return false;
    default:
        return false;
    }
}

bool CFrameWnd::OnUpdateCmdUI(CCmdUI* pCmdUI) {
    if (m_pActiveView && m_pActiveView->m_hWnd && m_pActiveView->OnUpdateCmdUI(pCmdUI))
        return true;
    switch (pCmdUI->m_nID) {
    case ID_VIEW_TOOLBAR:
    case ID_VIEW_STATUS_BAR:
        if (CControlBar* bar =
                GetControlBar(pCmdUI->m_nID == ID_VIEW_TOOLBAR ? AFX_IDW_TOOLBAR : AFX_IDW_STATUS_BAR)) {
            pCmdUI->SetCheck(bar->IsWindowVisible() ? 1 : 0);
            return true;
        }
        pCmdUI->Enable(false);
        return true;
    case ID_INDICATOR_CAPS:
        pCmdUI->Enable((::GetKeyState(VK_CAPITAL) & 1) != 0);
        return true;
    case ID_INDICATOR_NUM:
        pCmdUI->Enable((::GetKeyState(VK_NUMLOCK) & 1) != 0);
        return true;
    case ID_INDICATOR_SCRL:
        pCmdUI->Enable((::GetKeyState(VK_SCROLL) & 1) != 0);
        return true;
    default:
        return false;
    }
}

void CFrameWnd::OnIdleUpdateCmdUI() {
    for (size_t i = 0; i < m_bars.size(); ++i) { // an update handler may add or remove bars
        CControlBar* bar = m_bars[i];
        if (bar->m_hWnd && bar->IsWindowVisible())
            bar->UpdateCmdUIFrom(this);
    }
}

void CFrameWnd::OnMenuSelect(UINT itemId, UINT flags, HMENU menu) {
    Default();
    if (flags == 0xFFFF && !menu)
        SetMessageText(GetIdleMessage()); // the menu closed
    else if (!(flags & (MF_POPUP | MF_SEPARATOR | MF_SYSMENU)) && itemId)
        SetMessageText(GetMessageString(itemId));
    else
        SetMessageText(std::string());
}

bool CFrameWnd::OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult) {
    if (CWnd::OnNotify(wParam, lParam, pResult))
        return true;
    auto* hdr = reinterpret_cast<NMHDR*>(lParam);
    // Tooltips of the toolbar buttons: the part of the command's string after "\n".
    if (hdr->code == TTN_GETDISPINFOA || hdr->code == TTN_GETDISPINFOW) {
        UINT id = static_cast<UINT>(hdr->idFrom);
        if (reinterpret_cast<NMTTDISPINFOA*>(hdr)->uFlags & TTF_IDISHWND)
            id = static_cast<UINT>(::GetDlgCtrlID(reinterpret_cast<HWND>(hdr->idFrom)));
        std::string s = CWinApp::LoadString(id);
        size_t nl = s.find('\n');
        std::string tip = nl == std::string::npos ? std::string() : s.substr(nl + 1);
        if (tip.empty())
            return false;
        if (hdr->code == TTN_GETDISPINFOA)
            FillTip(reinterpret_cast<NMTTDISPINFOA*>(hdr), tip);
        else
            FillTip(reinterpret_cast<NMTTDISPINFOW*>(hdr), tip);
        *pResult = 0;
        return true;
    }
    return false;
}

LRESULT CFrameWnd::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_IDLEUPDATECMDUI:
        OnIdleUpdateCmdUI();
        return 0;
    case WM_EXITMENULOOP:
        SetMessageText(GetIdleMessage());
        return Default();
    default:
        return CWnd::WindowProc(message, wParam, lParam);
    }
}

void CFrameWnd::OnDestroy() {
    m_pActiveView = nullptr; // the views go with their windows
    m_bars.clear();
    Default();
}

void CFrameWnd::PostNcDestroy() {
    if (m_bAutoDelete)
        delete this;
}
