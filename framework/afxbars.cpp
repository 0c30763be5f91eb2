#include "afxbars.h"
#include "afxframe.h"

#include <algorithm>

namespace {

constexpr DWORD kWindowStyleBits = WS_CHILD | WS_VISIBLE | WS_CLIPSIBLINGS | WS_CLIPCHILDREN | WS_DISABLED;
constexpr int kGripperWidth = 8;

// One toolbar button's state, applied to the button when an update handler sets it.
class CToolCmdUI : public CCmdUI {
public:
    CToolCmdUI(HWND toolbar, UINT id) : CCmdUI(id), m_toolbar(toolbar) {}
    void Enable(bool on) override {
        CCmdUI::Enable(on);
        ::SendMessageA(m_toolbar, TB_ENABLEBUTTON, m_nID, MAKELPARAM(on ? TRUE : FALSE, 0));
    }
    void SetCheck(int check) override {
        CCmdUI::SetCheck(check);
        ::SendMessageA(m_toolbar, TB_CHECKBUTTON, m_nID, MAKELPARAM(check ? TRUE : FALSE, 0));
    }

private:
    HWND m_toolbar;
};

// One status pane's state: a disabled indicator shows no text.
class CPaneCmdUI : public CCmdUI {
public:
    CPaneCmdUI(CStatusBar* bar, int index, UINT id, std::string text)
        : CCmdUI(id), m_bar(bar), m_index(index), m_text(std::move(text)) {}
    void Enable(bool on) override {
        CCmdUI::Enable(on);
        if (m_bar->GetPaneText(m_index) != (on ? m_text : std::string()))
            m_bar->SetPaneText(m_index, on ? m_text : std::string());
    }
    void SetText(const char* text) override {
        CCmdUI::SetText(text);
        m_bar->SetPaneText(m_index, m_strText);
    }

private:
    CStatusBar* m_bar;
    int m_index;
    std::string m_text;
};

// Reads a toolbar resource. The resource compiler's layout is WORD version (1), image width, height,
// button count, then one WORD id per button (0 for a separator); GNU windres writes the same fields as
// DWORDs without the version. Both are accepted.
bool ParseToolBarResource(const void* data, DWORD bytes, CSize& image, std::vector<UINT>& ids) {
    const auto* w = static_cast<const WORD*>(data);
    if (bytes >= 8 && w[0] == 1 && bytes >= 8u + 2u * w[3]) {
        image = CSize(w[1], w[2]);
        ids.assign(w + 4, w + 4 + w[3]);
        return true;
    }
    const auto* d = static_cast<const DWORD*>(data);
    if (bytes >= 12 && d[2] < 0x10000 && bytes >= 12u + 4u * d[2]) {
        image = CSize(static_cast<int>(d[0]), static_cast<int>(d[1]));
        ids.assign(d + 3, d + 3 + d[2]);
        return true;
    }
    return false;
}

} // namespace

// ---- CControlBar ------------------------------------------------------------------------------------

DWORD CControlBar::TakeBarStyle(DWORD style) {
    m_dwBarStyle = style & ~kWindowStyleBits;
    return style & kWindowStyleBits;
}

void CControlBar::RegisterWithFrame(CWnd* parent) {
    if (auto* frame = dynamic_cast<CFrameWnd*>(parent))
        frame->AddControlBar(this);
}

// ---- CToolBar ---------------------------------------------------------------------------------------

bool CToolBar::CreateEx(CWnd* parent, DWORD ctrlStyle, DWORD style, CRect borders, UINT id) {
    DWORD windowStyle = TakeBarStyle(style);
    if (m_dwBarStyle & CBRS_TOOLTIPS)
        ctrlStyle |= TBSTYLE_TOOLTIPS;
    // The frame places the bar: no alignment or sizing of its own.
    DWORD fullStyle = windowStyle | ctrlStyle | CCS_NORESIZE | CCS_NOPARENTALIGN | CCS_NODIVIDER;
    if (!CWnd::CreateEx(0, TOOLBARCLASSNAMEA, nullptr, fullStyle, CRect(0, 0, 100, 30), parent, id))
        return false;
    SendMessage(TB_BUTTONSTRUCTSIZE, sizeof(TBBUTTON));
    if (m_dwBarStyle & CBRS_GRIPPER)
        SendMessage(TB_SETINDENT, kGripperWidth);
    RegisterWithFrame(parent);
    return true;
}

bool CToolBar::LoadToolBar(UINT resourceId) {
    HINSTANCE hInst = AfxGetResourceHandle();
    HRSRC res = ::FindResourceA(hInst, MAKEINTRESOURCEA(resourceId), MAKEINTRESOURCEA(241));
    HGLOBAL loaded = res ? ::LoadResource(hInst, res) : nullptr;
    const void* data = loaded ? ::LockResource(loaded) : nullptr;
    const DWORD bytes = res ? ::SizeofResource(hInst, res) : 0;
    std::vector<UINT> ids;
    if (!data || !ParseToolBarResource(data, bytes, m_sizeImage, ids))
        return false;
    const int count = static_cast<int>(ids.size());

    // Remove what an earlier load put there.
    while (SendMessage(TB_BUTTONCOUNT) > 0)
        SendMessage(TB_DELETEBUTTON, 0);
    SendMessage(TB_SETBITMAPSIZE, 0, MAKELPARAM(m_sizeImage.cx, m_sizeImage.cy));
    SendMessage(TB_SETBUTTONSIZE, 0, MAKELPARAM(m_sizeImage.cx + 7, m_sizeImage.cy + 7));

    int images = 0;
    for (int i = 0; i < count; ++i)
        images += ids[static_cast<size_t>(i)] != 0;
    // The toolbar loads the bitmap itself and maps its greys to the button face colour.
    TBADDBITMAP bitmap{hInst, resourceId};
    if (images > 0 &&
        SendMessage(TB_ADDBITMAP, static_cast<WPARAM>(images), reinterpret_cast<LPARAM>(&bitmap)) < 0)
        return false;

    std::vector<TBBUTTON> buttons(static_cast<size_t>(count));
    int image = 0;
    for (int i = 0; i < count; ++i) {
        TBBUTTON& b = buttons[static_cast<size_t>(i)];
        b = TBBUTTON{};
        b.idCommand = static_cast<int>(ids[static_cast<size_t>(i)]);
        b.fsState = TBSTATE_ENABLED;
        if (ids[static_cast<size_t>(i)] == 0) {
            b.fsStyle = BTNS_SEP;
            b.iBitmap = 8;
        } else {
            b.fsStyle = BTNS_BUTTON;
            b.iBitmap = image++;
        }
    }
    if (count > 0 &&
        !SendMessage(TB_ADDBUTTONSA, static_cast<WPARAM>(count), reinterpret_cast<LPARAM>(buttons.data())))
        return false;
    if (auto* frame = AfxGetParentFrame(this))
        frame->RecalcLayout();
    return true;
}

UINT CToolBar::GetItemID(int index) const {
    TBBUTTON b{};
    if (!SendMessage(TB_GETBUTTON, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&b)))
        return 0;
    return static_cast<UINT>(b.idCommand); // a placeholder turned separator keeps its id
}

UINT CToolBar::GetButtonStyle(int index) const {
    TBBUTTON b{};
    SendMessage(TB_GETBUTTON, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&b));
    return b.fsStyle;
}

void CToolBar::GetItemRect(int index, LPRECT rect) const {
    *rect = RECT{};
    SendMessage(TB_GETITEMRECT, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(rect));
}

void CToolBar::SetButtonInfo(int index, UINT id, UINT style, int imageOrWidth) {
    TBBUTTON b{};
    if (!SendMessage(TB_GETBUTTON, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&b)))
        return;
    b.idCommand = static_cast<int>(id);
    b.fsStyle = static_cast<BYTE>(style);
    b.iBitmap = imageOrWidth;
    b.fsState = style & BTNS_SEP ? 0 : TBSTATE_ENABLED;
    // The control cannot change a button into a separator in place: replace it.
    SendMessage(TB_DELETEBUTTON, static_cast<WPARAM>(index));
    SendMessage(TB_INSERTBUTTONA, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(&b));
    if (auto* frame = AfxGetParentFrame(this))
        frame->RecalcLayout();
}

int CToolBar::CalcHeight(int) const {
    DWORD size = static_cast<DWORD>(SendMessage(TB_GETBUTTONSIZE));
    int height = HIWORD(size) + 4;
    RECT rc{};
    const int count = static_cast<int>(SendMessage(TB_BUTTONCOUNT));
    for (int i = 0; i < count; ++i) {
        GetItemRect(i, &rc);
        height = std::max(height, static_cast<int>(rc.bottom) + 2);
    }
    return height;
}

void CToolBar::UpdateCmdUIFrom(CFrameWnd* target) {
    const int count = static_cast<int>(SendMessage(TB_BUTTONCOUNT));
    for (int i = 0; i < count; ++i) {
        UINT id = GetItemID(i);
        if (id == ID_SEPARATOR || (GetButtonStyle(i) & BTNS_SEP))
            continue;
        CToolCmdUI ui(m_hWnd, id);
        target->OnUpdateCmdUI(&ui);
    }
}

bool CToolBar::OnNotifyReflect(NMHDR* pNMHDR, LRESULT* pResult) {
    if (pNMHDR->code != static_cast<UINT>(TBN_HOTITEMCHANGE) || !(m_dwBarStyle & CBRS_FLYBY))
        return false;
    // Fly-by prompt of the hot button in the status bar; "Ready" when the mouse leaves.
    auto* hot = reinterpret_cast<NMTBHOTITEM*>(pNMHDR);
    if (CFrameWnd* frame = AfxGetParentFrame(this)) {
        if (hot->dwFlags & HICF_LEAVING || hot->idNew == 0)
            frame->SetMessageText(frame->GetIdleMessage());
        else
            frame->SetMessageText(frame->GetMessageString(static_cast<UINT>(hot->idNew)));
    }
    *pResult = 0;
    return true;
}

void CToolBar::OnPaint() {
    Default();
    if (!(m_dwBarStyle & CBRS_GRIPPER))
        return;
    CClientDC dc(m_hWnd);
    CRect rc = GetClientRect();
    CRect grip(2, 3, 5, rc.bottom - 3);
    dc.DrawEdge(grip, BDR_RAISEDINNER, BF_RECT);
}

// ---- CStatusBar -------------------------------------------------------------------------------------

bool CStatusBar::Create(CWnd* parent, DWORD style, UINT id) {
    DWORD windowStyle = TakeBarStyle(style);
    if (!CWnd::CreateEx(0, STATUSCLASSNAMEA, nullptr, windowStyle, CRect(0, 0, 100, 20), parent, id))
        return false;
    // Its natural height comes from its font; after that the frame places it.
    SendMessage(WM_SIZE);
    m_nHeight = std::max(GetWindowRect().Height(), 16);
    ModifyStyle(0, CCS_NORESIZE | CCS_NOPARENTALIGN);
    RegisterWithFrame(parent);
    return true;
}

bool CStatusBar::SetIndicators(const UINT* ids, int count) {
    m_panes.clear();
    CClientDC dc(m_hWnd);
    CSelectObject font(dc, GetFont() ? static_cast<HGDIOBJ>(GetFont()) : ::GetStockObject(DEFAULT_GUI_FONT));
    for (int i = 0; i < count; ++i) {
        Pane pane{ids[i], std::string(), 0};
        if (pane.id != ID_SEPARATOR) {
            pane.text = CWinApp::LoadString(pane.id);
            if (pane.text.empty()) {
                if (pane.id == ID_INDICATOR_CAPS)
                    pane.text = "CAP";
                else if (pane.id == ID_INDICATOR_NUM)
                    pane.text = "NUM";
                else if (pane.id == ID_INDICATOR_SCRL)
                    pane.text = "SCRL";
            }
            pane.width = dc.GetTextExtent(pane.text).cx + 12;
        }
        m_panes.push_back(pane);
    }
    ApplyParts();
    for (int i = 0; i < count; ++i)
        SetPaneText(i, m_panes[static_cast<size_t>(i)].text, false);
    return true;
}

void CStatusBar::ApplyParts() {
    if (m_panes.empty())
        return;
    // Right edges from the right: the fixed panes keep their widths, the separator panes share the rest.
    const int total = GetClientRect().Width();
    int fixed = 0, stretching = 0;
    for (const Pane& p : m_panes) {
        fixed += p.width;
        stretching += p.id == ID_SEPARATOR;
    }
    const int rest = std::max(0, total - fixed - ::GetSystemMetrics(SM_CXVSCROLL));
    std::vector<int> edges;
    int x = 0;
    for (const Pane& p : m_panes) {
        x += p.id == ID_SEPARATOR ? rest / std::max(stretching, 1) : p.width;
        edges.push_back(x);
    }
    edges.back() = -1; // the last pane reaches the right edge
    SendMessage(SB_SETPARTS, edges.size(), reinterpret_cast<LPARAM>(edges.data()));
}

int CStatusBar::CommandToIndex(UINT id) const {
    for (size_t i = 0; i < m_panes.size(); ++i)
        if (m_panes[i].id == id)
            return static_cast<int>(i);
    return -1;
}

UINT CStatusBar::GetItemID(int index) const {
    return index >= 0 && index < GetCount() ? m_panes[static_cast<size_t>(index)].id : ID_SEPARATOR;
}

bool CStatusBar::SetPaneText(int index, const std::string& text, bool update) {
    bool ok =
        SendMessage(SB_SETTEXTA, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(text.c_str())) != 0;
    if (update)
        UpdateWindow();
    return ok;
}

std::string CStatusBar::GetPaneText(int index) const {
    LRESULT info = SendMessage(SB_GETTEXTLENGTHA, static_cast<WPARAM>(index));
    std::string text(static_cast<size_t>(LOWORD(info)) + 1, '\0');
    SendMessage(SB_GETTEXTA, static_cast<WPARAM>(index), reinterpret_cast<LPARAM>(text.data()));
    text.resize(LOWORD(info));
    return text;
}

int CStatusBar::CalcHeight(int) const {
    return m_nHeight;
}

void CStatusBar::UpdateCmdUIFrom(CFrameWnd* target) {
    for (size_t i = 0; i < m_panes.size(); ++i) {
        if (m_panes[i].id == ID_SEPARATOR)
            continue;
        CPaneCmdUI ui(this, static_cast<int>(i), m_panes[i].id, m_panes[i].text);
        target->OnUpdateCmdUI(&ui);
    }
}

void CStatusBar::OnSize(UINT type, int cx, int cy) {
    Default();
    ApplyParts();
}

// ---- CToolTipCtrl -----------------------------------------------------------------------------------

bool CToolTipCtrl::Create(CWnd* parent, DWORD style) {
    if (!CWnd::CreateEx(WS_EX_TOPMOST, TOOLTIPS_CLASSA, nullptr, WS_POPUP | TTS_ALWAYSTIP | style, CRect(),
                        parent, 0))
        return false;
    ::SetWindowPos(m_hWnd, HWND_TOPMOST, 0, 0, 0, 0, SWP_NOMOVE | SWP_NOSIZE | SWP_NOACTIVATE);
    return true;
}

TTTOOLINFOA CToolTipCtrl::MakeInfo(CWnd* wnd, UINT_PTR toolId, const RECT* rect,
                                   const std::string& text) const {
    TTTOOLINFOA ti{};
    ti.cbSize = TTTOOLINFOA_V2_SIZE; // understood by every version of the control
    ti.hwnd = wnd ? wnd->m_hWnd : ::GetParent(m_hWnd);
    if (rect) {
        ti.uId = toolId;
        ti.rect = *rect;
    } else {
        ti.uFlags = TTF_IDISHWND;
        ti.uId = reinterpret_cast<UINT_PTR>(ti.hwnd);
    }
    ti.hinst = AfxGetResourceHandle();
    ti.lpszText = const_cast<char*>(text.c_str());
    return ti;
}

bool CToolTipCtrl::AddTool(CWnd* wnd, const std::string& text, const RECT* rect, UINT_PTR toolId) {
    TTTOOLINFOA ti = MakeInfo(wnd, toolId, rect, text);
    return SendMessage(TTM_ADDTOOLA, 0, reinterpret_cast<LPARAM>(&ti)) != 0;
}

void CToolTipCtrl::UpdateTipText(const std::string& text, CWnd* wnd, UINT_PTR toolId) {
    TTTOOLINFOA ti = MakeInfo(wnd, toolId, nullptr, text);
    if (toolId) {
        ti.uFlags = 0;
        ti.uId = toolId;
    }
    SendMessage(TTM_UPDATETIPTEXTA, 0, reinterpret_cast<LPARAM>(&ti));
}
