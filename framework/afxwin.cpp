#include "afxwin.h"

#include <cstdio>
#include <deque>
#include <exception>
#include <vector>

extern "C" IMAGE_DOS_HEADER __ImageBase;

namespace {

CWinApp* g_pApp = nullptr;
bool g_bInitDone = false;
AFX_ERROR_REPORTER g_reporter = nullptr;

// Marks the windows bound by this module (the value is the module handle, so that two copies of the
// framework in one process -- a host program and this library -- never take each other's windows).
const char* const kBindProperty = "Orvex1.CWnd";

// Window classes registered by this module, unregistered by AfxWinTerm. A deque keeps the names where
// they are, so the pointers AfxRegisterWndClass hands out stay valid until then.
std::deque<std::string>& RegisteredClasses() {
    static std::deque<std::string> names;
    return names;
}

const char* StableName(const std::string& name) {
    for (const std::string& known : RegisteredClasses())
        if (known == name)
            return known.c_str();
    return nullptr;
}

bool RegisterFrameworkClass(const char* name, UINT style, HCURSOR cursor, HBRUSH background, HICON icon) {
    HINSTANCE hInst = AfxGetInstanceHandle();
    WNDCLASSEXA existing{};
    existing.cbSize = sizeof existing;
    if (::GetClassInfoExA(hInst, name, &existing)) {
        if (existing.lpfnWndProc == AfxWndProc) {
            if (!StableName(name))
                RegisteredClasses().emplace_back(name);
            return true;
        }
        // Left behind by an earlier load of this library whose code is gone: replace it.
        ::UnregisterClassA(name, hInst);
    }
    WNDCLASSEXA wc{};
    wc.cbSize = sizeof wc;
    wc.style = style;
    wc.lpfnWndProc = AfxWndProc;
    wc.hInstance = hInst;
    wc.hCursor = cursor;
    wc.hbrBackground = background;
    wc.hIcon = icon;
    wc.lpszClassName = name;
    if (!::RegisterClassExA(&wc))
        return false;
    RegisteredClasses().emplace_back(name);
    return true;
}

bool IsFrameworkClass(const char* className) {
    if (!className)
        return true;
    WNDCLASSEXA wc{};
    wc.cbSize = sizeof wc;
    return ::GetClassInfoExA(AfxGetInstanceHandle(), className, &wc) && wc.lpfnWndProc == AfxWndProc;
}

void DefaultReporter(const char* text) {
    ::MessageBoxA(nullptr, text, "Orvex1", MB_OK | MB_ICONEXCLAMATION | MB_TASKMODAL);
}

} // namespace

// ---- module state -----------------------------------------------------------------------------------

HINSTANCE AfxGetInstanceHandle() {
    return reinterpret_cast<HINSTANCE>(&__ImageBase);
}
HINSTANCE AfxGetResourceHandle() {
    return AfxGetInstanceHandle();
}
CWinApp* AfxGetApp() {
    return g_pApp;
}
CWnd* AfxGetMainWnd() {
    return g_pApp ? g_pApp->m_pMainWnd : nullptr;
}

bool AfxWinInit() {
    if (g_bInitDone || !g_pApp)
        return true;
    g_bInitDone = true;
    try {
        return g_pApp->InitInstance();
    } catch (...) {
        AfxReportCurrentException();
        return false;
    }
}

void AfxWinTerm() {
    if (g_pApp && g_bInitDone) {
        try {
            g_pApp->ExitInstance();
        } catch (...) {
            AfxReportCurrentException();
        }
    }
    g_bInitDone = false;
    for (const std::string& name : RegisteredClasses())
        ::UnregisterClassA(name.c_str(), AfxGetInstanceHandle());
    RegisteredClasses().clear();
}

AFX_ERROR_REPORTER AfxSetErrorReporter(AFX_ERROR_REPORTER reporter) {
    AFX_ERROR_REPORTER previous = g_reporter;
    g_reporter = reporter;
    return previous;
}

void AfxReportError(const char* text) {
    try {
        (g_reporter ? g_reporter : DefaultReporter)(text ? text : "");
    } catch (...) {
        // A reporter that throws has nowhere left to report to.
    }
}

void AfxReportCurrentException() {
    try {
        throw;
    } catch (const std::exception& e) {
        AfxReportError(e.what());
    } catch (...) {
        AfxReportError("An unknown error occurred.");
    }
}

const char* const AFX_WND_CLASS = "Orvex1Wnd";

void AfxInitCommonControls() {
    static bool done = false;
    if (done)
        return;
    INITCOMMONCONTROLSEX icc{sizeof icc, ICC_WIN95_CLASSES | ICC_BAR_CLASSES | ICC_TREEVIEW_CLASSES};
    done = ::InitCommonControlsEx(&icc) != FALSE;
}

const char* AfxRegisterWndClass(UINT classStyle, HCURSOR cursor, HBRUSH background, HICON icon) {
    char name[96];
    if (classStyle == (CS_DBLCLKS | CS_HREDRAW | CS_VREDRAW) && !cursor && !background && !icon) {
        RegisterFrameworkClass(AFX_WND_CLASS, classStyle, ::LoadCursorA(nullptr, IDC_ARROW),
                               reinterpret_cast<HBRUSH>(COLOR_WINDOW + 1), nullptr);
        return AFX_WND_CLASS;
    }
    std::snprintf(name, sizeof name, "Orvex1:%x:%p:%p:%p", classStyle, static_cast<void*>(cursor),
                  static_cast<void*>(background), static_cast<void*>(icon));
    if (const char* known = StableName(name))
        return known;
    if (!RegisterFrameworkClass(name, classStyle, cursor, background, icon))
        return AFX_WND_CLASS;
    return StableName(name);
}

// ---- CWinApp ----------------------------------------------------------------------------------------

CWinApp::CWinApp(const char* appName) : m_strAppName(appName ? appName : "") {
    g_pApp = this;
    m_hInstance = AfxGetInstanceHandle();
}

CWinApp::~CWinApp() {
    if (g_pApp == this)
        g_pApp = nullptr;
}

bool CWinApp::OnIdle(long count) {
    if (count == 0)
        AfxIdleUpdateCmdUI();
    return false;
}

std::string CWinApp::LoadString(UINT id) {
    char buffer[1024];
    int n = ::LoadStringA(AfxGetResourceHandle(), id, buffer, sizeof buffer);
    return std::string(buffer, n > 0 ? static_cast<size_t>(n) : 0);
}

// ---- window procedure -------------------------------------------------------------------------------

CWnd* CWnd::FromHandle(HWND hwnd) {
    if (!hwnd || ::GetPropA(hwnd, kBindProperty) != reinterpret_cast<HANDLE>(AfxGetInstanceHandle()))
        return nullptr;
    return reinterpret_cast<CWnd*>(::GetWindowLongPtrA(hwnd, GWLP_USERDATA));
}

void CWnd::Bind(HWND hwnd) {
    m_hWnd = hwnd;
    m_bBound = true;
    ::SetWindowLongPtrA(hwnd, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(this));
    ::SetPropA(hwnd, kBindProperty, reinterpret_cast<HANDLE>(AfxGetInstanceHandle()));
}

void CWnd::Unbind() {
    if (m_hWnd && m_bBound) {
        ::RemovePropA(m_hWnd, kBindProperty);
        ::SetWindowLongPtrA(m_hWnd, GWLP_USERDATA, 0);
        // A subclassed window gets its own procedure back for the messages that may still follow.
        if (m_pfnSuper && m_pfnSuper != ::DefWindowProcA &&
            reinterpret_cast<WNDPROC>(::GetWindowLongPtrA(m_hWnd, GWLP_WNDPROC)) == AfxWndProc)
            ::SetWindowLongPtrA(m_hWnd, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(m_pfnSuper));
    }
    m_bBound = false;
    m_hWnd = nullptr;
}

LRESULT AfxFailureResult(UINT message) {
    switch (message) {
    case WM_NCCREATE:
        return FALSE;
    case WM_CREATE:
        return -1;
    default:
        return 0;
    }
}

LRESULT CWnd::DispatchGuarded(UINT message, WPARAM wParam, LPARAM lParam, bool& objectGone) {
    const CurrentMessage saved = m_current;
    m_current = {message, wParam, lParam};
    Dispatch dispatch;
    dispatch.outer = m_pDispatch;
    m_pDispatch = &dispatch;
    LRESULT result = 0;
    try {
        result = WindowProc(message, wParam, lParam);
    } catch (...) {
        AfxReportCurrentException();
        result = AfxFailureResult(message);
    }
    objectGone = dispatch.objectGone;
    if (!objectGone) { // else `this` is freed memory: nothing more may be written into it
        m_pDispatch = dispatch.outer;
        m_current = saved;
    }
    return result;
}

LRESULT CALLBACK AfxWndProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    CWnd* pWnd = CWnd::FromHandle(hwnd);
    if (!pWnd && message == WM_NCCREATE) {
        auto* cs = reinterpret_cast<CREATESTRUCTA*>(lParam);
        pWnd = static_cast<CWnd*>(cs->lpCreateParams);
        if (pWnd) {
            pWnd->m_pfnSuper = ::DefWindowProcA;
            pWnd->Bind(hwnd);
        }
    }
    if (!pWnd) // messages before WM_NCCREATE, or a window created without an object
        return ::DefWindowProcA(hwnd, message, wParam, lParam);

    bool objectGone = false;
    LRESULT result = pWnd->DispatchGuarded(message, wParam, lParam, objectGone);
    if (message == WM_NCDESTROY && !objectGone) {
        pWnd->Unbind();
        try {
            pWnd->PostNcDestroy(); // may delete the object
        } catch (...) {
            AfxReportCurrentException();
        }
    }
    return result;
}

// ---- CWnd -------------------------------------------------------------------------------------------

CWnd::~CWnd() {
    // Messages still being handled for this object (it was deleted from inside one) must not touch it.
    for (Dispatch* dispatch = m_pDispatch; dispatch; dispatch = dispatch->outer)
        dispatch->objectGone = true;
    if (m_hWnd && m_bBound) {
        // The derived parts are gone already: the window's last messages get the base handling.
        ::DestroyWindow(m_hWnd);
        Unbind();
    }
}

bool CWnd::PreCreateWindow(CREATESTRUCTA& cs) {
    if (!cs.lpszClass)
        cs.lpszClass = AfxRegisterWndClass(CS_DBLCLKS | CS_HREDRAW | CS_VREDRAW);
    return true;
}

bool CWnd::CreateEx(DWORD exStyle, const char* className, const char* windowName, DWORD style,
                    const RECT& rect, CWnd* parent, UINT id) {
    if (m_hWnd)
        return false;
    CREATESTRUCTA cs{};
    cs.dwExStyle = exStyle;
    cs.lpszClass = className;
    cs.lpszName = windowName;
    cs.style = static_cast<LONG>(style);
    cs.x = rect.left;
    cs.y = rect.top;
    cs.cx = rect.right - rect.left;
    cs.cy = rect.bottom - rect.top;
    cs.hwndParent = parent ? parent->m_hWnd : nullptr;
    cs.hMenu = (style & WS_CHILD) ? reinterpret_cast<HMENU>(static_cast<UINT_PTR>(id)) : nullptr;
    cs.hInstance = AfxGetInstanceHandle();
    cs.lpCreateParams = this;
    if (!PreCreateWindow(cs))
        return false;

    const bool own = IsFrameworkClass(cs.lpszClass);
    if (!own)
        AfxInitCommonControls();
    HWND hwnd =
        ::CreateWindowExA(cs.dwExStyle, cs.lpszClass, cs.lpszName, static_cast<DWORD>(cs.style), cs.x, cs.y,
                          cs.cx, cs.cy, cs.hwndParent, cs.hMenu, cs.hInstance, own ? this : nullptr);
    if (!hwnd) // a window that failed in WM_CREATE was unbound on WM_NCDESTROY (PostNcDestroy ran)
        return false;
    if (!own)
        return SubclassWindow(hwnd);
    return true;
}

bool CWnd::Create(const char* className, const char* windowName, DWORD style, const RECT& rect, CWnd* parent,
                  UINT id) {
    return CreateEx(0, className, windowName, style | WS_CHILD, rect, parent, id);
}

bool CWnd::DestroyWindow() {
    if (!m_hWnd)
        return false;
    if (!m_bBound) { // attached, not ours to destroy
        m_hWnd = nullptr;
        return false;
    }
    return ::DestroyWindow(m_hWnd) != FALSE; // WM_NCDESTROY unbinds
}

bool CWnd::SubclassWindow(HWND hwnd) {
    if (m_hWnd || !hwnd || FromHandle(hwnd))
        return false;
    m_pfnSuper = reinterpret_cast<WNDPROC>(::GetWindowLongPtrA(hwnd, GWLP_WNDPROC));
    Bind(hwnd);
    ::SetWindowLongPtrA(hwnd, GWLP_WNDPROC, reinterpret_cast<LONG_PTR>(AfxWndProc));
    PreSubclassWindow();
    return true;
}

bool CWnd::SubclassDlgItem(UINT id, CWnd* parent) {
    return parent && SubclassWindow(::GetDlgItem(parent->m_hWnd, static_cast<int>(id)));
}

HWND CWnd::UnsubclassWindow() {
    HWND hwnd = m_hWnd;
    Unbind();
    m_pfnSuper = nullptr;
    return hwnd;
}

void CWnd::Attach(HWND hwnd) {
    if (!m_hWnd) {
        m_hWnd = hwnd;
        m_bBound = false;
    }
}

HWND CWnd::Detach() {
    if (m_bBound)
        return UnsubclassWindow();
    return std::exchange(m_hWnd, nullptr);
}

LRESULT CWnd::Default() {
    WNDPROC proc = m_pfnSuper ? m_pfnSuper : ::DefWindowProcA;
    return ::CallWindowProcA(proc, m_hWnd, m_current.message, m_current.wParam, m_current.lParam);
}

bool CWnd::PreTranslateMessage(MSG*) {
    return false;
}

bool CWnd::OnCmdMsg(UINT, int) {
    return false;
}

bool CWnd::OnUpdateCmdUI(CCmdUI*) {
    return false;
}

bool CWnd::OnChildNotify(UINT message, WPARAM wParam, LPARAM lParam, LRESULT* pResult) {
    switch (message) {
    case WM_COMMAND:
        if (OnCommandReflect(HIWORD(wParam))) {
            *pResult = 0;
            return true;
        }
        return false;
    case WM_NOTIFY:
        return OnNotifyReflect(reinterpret_cast<NMHDR*>(lParam), pResult);
    case WM_CTLCOLORSTATIC:
    case WM_CTLCOLOREDIT:
    case WM_CTLCOLORBTN:
    case WM_CTLCOLORLISTBOX:
    case WM_CTLCOLORSCROLLBAR:
        if (HBRUSH brush = OnCtlColorReflect(reinterpret_cast<HDC>(wParam), message)) {
            *pResult = reinterpret_cast<LRESULT>(brush);
            return true;
        }
        return false;
    default:
        return false;
    }
}

bool CWnd::OnCommand(WPARAM wParam, LPARAM lParam) {
    if (lParam) {
        if (CWnd* child = FromHandle(reinterpret_cast<HWND>(lParam)); child && child != this) {
            LRESULT ignored = 0;
            if (child->OnChildNotify(WM_COMMAND, wParam, lParam, &ignored))
                return true;
        }
    }
    return OnCmdMsg(LOWORD(wParam), HIWORD(wParam));
}

bool CWnd::OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult) {
    auto* hdr = reinterpret_cast<NMHDR*>(lParam);
    if (hdr && hdr->hwndFrom != m_hWnd) {
        if (CWnd* child = FromHandle(hdr->hwndFrom))
            return child->OnChildNotify(WM_NOTIFY, wParam, lParam, pResult);
    }
    return false;
}

int CWnd::OnCreate(LPCREATESTRUCTA) {
    return static_cast<int>(Default());
}

namespace {

// One menu item's state, applied to the menu when an update handler sets it.
class CMenuCmdUI : public CCmdUI {
public:
    CMenuCmdUI(HMENU menu, UINT position, UINT id) : CCmdUI(id), m_menu(menu), m_position(position) {}
    void Enable(bool on) override {
        CCmdUI::Enable(on);
        ::EnableMenuItem(m_menu, m_position, MF_BYPOSITION | (on ? MF_ENABLED : MF_GRAYED));
    }
    void SetCheck(int check) override {
        CCmdUI::SetCheck(check);
        ::CheckMenuItem(m_menu, m_position, MF_BYPOSITION | (check ? MF_CHECKED : MF_UNCHECKED));
    }
    void SetText(const char* text) override {
        CCmdUI::SetText(text);
        MENUITEMINFOA mii{};
        mii.cbSize = sizeof mii;
        mii.fMask = MIIM_STRING;
        mii.dwTypeData = const_cast<char*>(m_strText.c_str());
        ::SetMenuItemInfoA(m_menu, m_position, TRUE, &mii);
    }

private:
    HMENU m_menu;
    UINT m_position;
};

} // namespace

void CWnd::OnInitMenuPopup(HMENU popup, UINT, bool sysMenu) {
    Default();
    if (sysMenu)
        return;
    const int count = ::GetMenuItemCount(popup);
    for (int i = 0; i < count; ++i) {
        UINT id = ::GetMenuItemID(popup, i);
        if (id == 0 || id == static_cast<UINT>(-1)) // separator or submenu
            continue;
        CMenuCmdUI ui(popup, static_cast<UINT>(i), id);
        OnUpdateCmdUI(&ui);
    }
}

LRESULT CWnd::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_CREATE:
        return OnCreate(reinterpret_cast<LPCREATESTRUCTA>(lParam));
    case WM_DESTROY:
        OnDestroy();
        return 0;
    case WM_NCDESTROY:
        OnNcDestroy();
        return 0;
    case WM_CLOSE:
        OnClose();
        return 0;
    case WM_SIZE:
        OnSize(static_cast<UINT>(wParam), static_cast<short>(LOWORD(lParam)),
               static_cast<short>(HIWORD(lParam)));
        return 0;
    case WM_MOVE:
        OnMove(static_cast<short>(LOWORD(lParam)), static_cast<short>(HIWORD(lParam)));
        return 0;
    case WM_PAINT:
        OnPaint();
        return 0;
    case WM_ERASEBKGND: {
        CDC dc(reinterpret_cast<HDC>(wParam));
        return OnEraseBkgnd(&dc);
    }
    case WM_TIMER:
        OnTimer(wParam);
        return 0;
    case WM_SETFOCUS:
        OnSetFocus(reinterpret_cast<HWND>(wParam));
        return 0;
    case WM_KILLFOCUS:
        OnKillFocus(reinterpret_cast<HWND>(wParam));
        return 0;
    case WM_KEYDOWN:
        OnKeyDown(static_cast<UINT>(wParam), LOWORD(lParam), HIWORD(lParam));
        return 0;
    case WM_KEYUP:
        OnKeyUp(static_cast<UINT>(wParam), LOWORD(lParam), HIWORD(lParam));
        return 0;
    case WM_CHAR:
        OnChar(static_cast<UINT>(wParam), LOWORD(lParam), HIWORD(lParam));
        return 0;
    case WM_MOUSEMOVE:
        OnMouseMove(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_LBUTTONDOWN:
        OnLButtonDown(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_LBUTTONUP:
        OnLButtonUp(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_LBUTTONDBLCLK:
        OnLButtonDblClk(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_RBUTTONDOWN:
        OnRButtonDown(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_RBUTTONUP:
        OnRButtonUp(static_cast<UINT>(wParam), CPoint(lParam));
        return 0;
    case WM_MOUSEWHEEL:
        return OnMouseWheel(LOWORD(wParam), static_cast<short>(HIWORD(wParam)), CPoint(lParam));
    case WM_CONTEXTMENU:
        OnContextMenu(reinterpret_cast<HWND>(wParam), CPoint(lParam));
        return 0;
    case WM_SETCURSOR:
        return OnSetCursor(reinterpret_cast<HWND>(wParam), LOWORD(lParam), HIWORD(lParam));
    case WM_HSCROLL:
        OnHScroll(LOWORD(wParam), HIWORD(wParam), reinterpret_cast<HWND>(lParam));
        return 0;
    case WM_VSCROLL:
        OnVScroll(LOWORD(wParam), HIWORD(wParam), reinterpret_cast<HWND>(lParam));
        return 0;
    case WM_SHOWWINDOW:
        OnShowWindow(wParam != 0, static_cast<UINT>(lParam));
        return 0;
    case WM_GETMINMAXINFO:
        OnGetMinMaxInfo(reinterpret_cast<MINMAXINFO*>(lParam));
        return 0;
    case WM_INITMENUPOPUP:
        OnInitMenuPopup(reinterpret_cast<HMENU>(wParam), LOWORD(lParam), HIWORD(lParam) != 0);
        return 0;
    case WM_MENUSELECT:
        OnMenuSelect(LOWORD(wParam), HIWORD(wParam), reinterpret_cast<HMENU>(lParam));
        return 0;
    case WM_ACTIVATE:
        OnActivate(LOWORD(wParam), reinterpret_cast<HWND>(lParam), HIWORD(wParam) != 0);
        return 0;
    case WM_COMMAND:
        if (OnCommand(wParam, lParam))
            return 0;
        return Default();
    case WM_NOTIFY: {
        LRESULT result = 0;
        if (OnNotify(wParam, lParam, &result))
            return result;
        return Default();
    }
    case WM_CTLCOLORSTATIC:
    case WM_CTLCOLOREDIT:
    case WM_CTLCOLORBTN:
    case WM_CTLCOLORLISTBOX:
    case WM_CTLCOLORSCROLLBAR: {
        LRESULT result = 0;
        CWnd* child = FromHandle(reinterpret_cast<HWND>(lParam));
        if (child && child != this && child->OnChildNotify(message, wParam, lParam, &result))
            return result;
        return Default();
    }
    default:
        return Default();
    }
}

std::string CWnd::GetWindowText() const {
    int n = ::GetWindowTextLengthA(m_hWnd);
    std::string text(static_cast<size_t>(n > 0 ? n : 0) + 1, '\0');
    n = ::GetWindowTextA(m_hWnd, text.data(), static_cast<int>(text.size()));
    text.resize(static_cast<size_t>(n > 0 ? n : 0));
    return text;
}

std::string CWnd::GetDlgItemText(int id) const {
    HWND item = ::GetDlgItem(m_hWnd, id);
    int n = item ? ::GetWindowTextLengthA(item) : 0;
    std::string text(static_cast<size_t>(n > 0 ? n : 0) + 1, '\0');
    n = ::GetDlgItemTextA(m_hWnd, id, text.data(), static_cast<int>(text.size()));
    text.resize(static_cast<size_t>(n > 0 ? n : 0));
    return text;
}

CRect CWnd::GetClientRect() const {
    CRect rc;
    ::GetClientRect(m_hWnd, &rc);
    return rc;
}

CRect CWnd::GetWindowRect() const {
    CRect rc;
    ::GetWindowRect(m_hWnd, &rc);
    return rc;
}

CWnd* CWnd::SetFocus() {
    return FromHandle(::SetFocus(m_hWnd));
}

bool CWnd::ModifyStyle(DWORD remove, DWORD add, UINT swpFlags) {
    DWORD style = GetStyle();
    DWORD changed = (style & ~remove) | add;
    if (changed == style)
        return false;
    ::SetWindowLongPtrA(m_hWnd, GWL_STYLE, static_cast<LONG_PTR>(changed));
    if (swpFlags)
        ::SetWindowPos(m_hWnd, nullptr, 0, 0, 0, 0,
                       SWP_NOSIZE | SWP_NOMOVE | SWP_NOZORDER | SWP_NOACTIVATE | swpFlags);
    return true;
}

void CWnd::CenterWindow(HWND alternateOwner) {
    HWND owner = alternateOwner ? alternateOwner : ::GetWindow(m_hWnd, GW_OWNER);
    RECT area{};
    if (owner && ::IsWindowVisible(owner) && !::IsIconic(owner))
        ::GetWindowRect(owner, &area);
    else
        ::SystemParametersInfoA(SPI_GETWORKAREA, 0, &area, 0);
    CRect rc = GetWindowRect();
    int x = (area.left + area.right - rc.Width()) / 2;
    int y = (area.top + area.bottom - rc.Height()) / 2;
    ::SetWindowPos(m_hWnd, nullptr, x, y, 0, 0, SWP_NOSIZE | SWP_NOZORDER | SWP_NOACTIVATE);
}

// ---- message loop helpers ---------------------------------------------------------------------------

bool AfxPreTranslateMessage(MSG* pMsg, CWnd* pModal) {
    HWND top = nullptr;
    for (HWND hwnd = pMsg->hwnd; hwnd;) {
        if (CWnd* pWnd = CWnd::FromHandle(hwnd); pWnd && pWnd->PreTranslateMessage(pMsg))
            return true;
        top = hwnd;
        if (!::IsWindow(hwnd) || !(::GetWindowLongPtrA(hwnd, GWL_STYLE) & WS_CHILD))
            break;
        hwnd = ::GetParent(hwnd);
    }
    CWnd* pMain = AfxGetMainWnd();
    if (pMain && pMain->m_hWnd && pMain->m_hWnd != top && pMain->PreTranslateMessage(pMsg))
        return true;
    if (pModal && pModal != pMain && pModal->m_hWnd && pModal->m_hWnd != top &&
        pModal->PreTranslateMessage(pMsg))
        return true;
    return false;
}

namespace {

BOOL CALLBACK SendIdleUpdate(HWND hwnd, LPARAM) {
    if (CWnd::FromHandle(hwnd) && ::IsWindowVisible(hwnd))
        ::SendMessageA(hwnd, WM_IDLEUPDATECMDUI, TRUE, 0);
    return TRUE;
}

} // namespace

void AfxIdleUpdateCmdUI() {
    ::EnumThreadWindows(::GetCurrentThreadId(), SendIdleUpdate, 0);
}

// ---- CMenu ------------------------------------------------------------------------------------------

CMenu& CMenu::operator=(CMenu&& o) noexcept {
    if (this != &o) {
        DestroyMenu();
        m_hMenu = std::exchange(o.m_hMenu, nullptr);
        m_bOwned = o.m_bOwned;
    }
    return *this;
}

bool CMenu::LoadMenu(UINT resourceId) {
    DestroyMenu();
    m_hMenu = ::LoadMenuA(AfxGetResourceHandle(), MAKEINTRESOURCEA(resourceId));
    m_bOwned = m_hMenu != nullptr;
    return m_bOwned;
}

bool CMenu::CreatePopupMenu() {
    DestroyMenu();
    m_hMenu = ::CreatePopupMenu();
    m_bOwned = m_hMenu != nullptr;
    return m_bOwned;
}

void CMenu::Attach(HMENU menu) {
    DestroyMenu();
    m_hMenu = menu;
    m_bOwned = false;
}

HMENU CMenu::Detach() {
    m_bOwned = false;
    return std::exchange(m_hMenu, nullptr);
}

bool CMenu::DestroyMenu() {
    HMENU menu = std::exchange(m_hMenu, nullptr);
    bool owned = std::exchange(m_bOwned, false);
    return menu && owned && ::DestroyMenu(menu);
}

CMenu CMenu::GetSubMenu(int position) const {
    CMenu sub;
    sub.Attach(::GetSubMenu(m_hMenu, position));
    return sub;
}
