// The window-class framework: module state, application object, windows, dialogs, edits, statics, menus.
//
// Module state. The framework is linked into one module (the extension library Orvex1.arx, or a test
// program). AfxGetInstanceHandle() is that module, taken from __ImageBase, and the window classes of the
// framework are registered against it under names beginning with "Orvex1". A DLL has no WinMain, so the
// module starts its application object explicitly: AfxWinInit() runs CWinApp::InitInstance once (call it
// from the module's entry point, on its initialisation message, never from DllMain), and AfxWinTerm()
// runs ExitInstance and unregisters the window classes, so that the library can be unloaded and loaded
// again in the same process.
//
// Binding. A CWnd is bound to its HWND through GWLP_USERDATA (set on WM_NCCREATE for the framework's own
// classes, on WM_INITDIALOG for dialogs, by SubclassWindow for controls of the system classes) and
// unbound on WM_NCDESTROY. A window property marks the windows bound by this module, so FromHandle never
// trusts the user data of a window that some other code owns. There is no window map: FromHandle gives
// the bound object or nullptr.
//
// Dispatch. Each class has one virtual WindowProc: a switch that calls small OnXxx methods whose base
// versions do the default processing (Default()). WM_COMMAND notifications from controls, WM_NOTIFY and
// WM_CTLCOLOR* are first offered to the control's own wrapper (OnChildNotify); commands from menus,
// accelerators and toolbars go to OnCmdMsg.
//
// Errors. No exception leaves a window procedure, a dialog procedure or a modal loop of the framework:
// it is reported through the error reporter (a message box unless the module sets its own) and the
// message counts as handled.
//
// Ownership. A CWnd owns the window it created or subclassed: destroying the object destroys the window
// (prefer DestroyWindow() first, while the derived handlers still run). A window object created with new
// for the lifetime of its window deletes itself in PostNcDestroy (frames and views do).
#pragma once

#include "afxexcept.h"
#include "afxgdi.h"

#include <windows.h>
#include <commctrl.h>

#include <string>

class CWnd;
class CWinApp;
class CCmdUI;

// ---- module state, errors ---------------------------------------------------------------------------

HINSTANCE AfxGetInstanceHandle();
HINSTANCE AfxGetResourceHandle();
CWinApp* AfxGetApp();
CWnd* AfxGetMainWnd();

// Starts the module's application object (InitInstance); returns its result, true without an app.
bool AfxWinInit();
// Ends it (ExitInstance) and unregisters the framework's window classes.
void AfxWinTerm();

using AFX_ERROR_REPORTER = void (*)(const char* text);
// Sets how caught exceptions are shown; nullptr restores the default message box. Returns the previous.
AFX_ERROR_REPORTER AfxSetErrorReporter(AFX_ERROR_REPORTER reporter);
void AfxReportError(const char* text);
// Reports the exception being handled; call only inside a catch block.
void AfxReportCurrentException();

// The framework's default window class: arrow cursor, window-colour background, double clicks.
extern const char* const AFX_WND_CLASS;
// Returns the name of a framework window class with these attributes, registering it on first use.
const char* AfxRegisterWndClass(UINT classStyle, HCURSOR cursor = nullptr, HBRUSH background = nullptr,
                                HICON icon = nullptr);

// Registers the common controls (toolbar, status bar, tree, tooltips) once; creating one calls it.
void AfxInitCommonControls();

// Offers a message to PreTranslateMessage: from its window up through the parents to the top-level
// window, then to the application's main window and to pModal when the walk did not reach them.
bool AfxPreTranslateMessage(MSG* pMsg, CWnd* pModal = nullptr);
// Idle work of a message loop whose queue just emptied: update handlers of every framework window.
void AfxIdleUpdateCmdUI();

// Sent on idle to the framework's top-level windows (the frame updates its toolbar buttons).
constexpr UINT WM_IDLEUPDATECMDUI = 0x0363;

// ---- command user interface -------------------------------------------------------------------------

// The state of one command's user-interface item (menu item or toolbar button), set by update handlers.
class CCmdUI {
public:
    explicit CCmdUI(UINT id) : m_nID(id) {}
    virtual ~CCmdUI() = default;
    virtual void Enable(bool on = true) { m_bEnabled = on; }
    virtual void SetCheck(int check = 1) { m_nCheck = check; }
    virtual void SetText(const char* text) { m_strText = text ? text : ""; }

    UINT m_nID;
    bool m_bEnabled = true;
    int m_nCheck = 0;
    std::string m_strText;
};

// ---- CWnd -------------------------------------------------------------------------------------------

class CWnd {
public:
    CWnd() = default;
    virtual ~CWnd();
    CWnd(const CWnd&) = delete;
    CWnd& operator=(const CWnd&) = delete;

    HWND m_hWnd = nullptr;

    HWND GetSafeHwnd() const { return m_hWnd; }
    operator HWND() const { return m_hWnd; }
    // The framework object bound to hwnd, or nullptr.
    static CWnd* FromHandle(HWND hwnd);

    // Creation. A null class name means AFX_WND_CLASS. Windows of system classes are subclassed.
    virtual bool CreateEx(DWORD exStyle, const char* className, const char* windowName, DWORD style,
                          const RECT& rect, CWnd* parent, UINT id);
    virtual bool Create(const char* className, const char* windowName, DWORD style, const RECT& rect,
                        CWnd* parent, UINT id);
    // Lets a class adjust class, styles and placement before the window is created.
    virtual bool PreCreateWindow(CREATESTRUCTA& cs);
    virtual bool DestroyWindow();

    // Binds an existing window (a control of a system class, a dialog control) and routes its messages
    // through WindowProc; Default() then calls the window's original procedure.
    bool SubclassWindow(HWND hwnd);
    // Called by SubclassWindow (and so for every control CreateEx makes of a system class) once the
    // window is bound, before the caller sees it: a wrapper's hook for its control's set-up.
    virtual void PreSubclassWindow() {}
    bool SubclassDlgItem(UINT id, CWnd* parent);
    HWND UnsubclassWindow();
    // Non-owning use of a foreign window: no binding, no subclassing, never destroyed by this object.
    void Attach(HWND hwnd);
    HWND Detach();

    // Message handling.
    virtual LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam);
    LRESULT Default();
    virtual bool PreTranslateMessage(MSG* pMsg);
    // A command from a menu, an accelerator or a toolbar (or a control notification nobody reflected).
    virtual bool OnCmdMsg(UINT id, int code);
    // Sets the state of one command's menu item or button; true when the command is known here.
    virtual bool OnUpdateCmdUI(CCmdUI* pCmdUI);
    // A notification of this control, reflected by its parent; true when handled (*pResult is then used).
    virtual bool OnChildNotify(UINT message, WPARAM wParam, LPARAM lParam, LRESULT* pResult);
    virtual void PostNcDestroy() {}

    // Window wrappers.
    bool ShowWindow(int cmd) { return ::ShowWindow(m_hWnd, cmd) != FALSE; }
    bool MoveWindow(int x, int y, int width, int height, bool repaint = true) {
        return ::MoveWindow(m_hWnd, x, y, width, height, repaint) != FALSE;
    }
    bool MoveWindow(const RECT& rc, bool repaint = true) {
        return MoveWindow(rc.left, rc.top, rc.right - rc.left, rc.bottom - rc.top, repaint);
    }
    bool SetWindowPos(HWND insertAfter, int x, int y, int cx, int cy, UINT flags) {
        return ::SetWindowPos(m_hWnd, insertAfter, x, y, cx, cy, flags) != FALSE;
    }
    void SetWindowText(const std::string& text) { ::SetWindowTextA(m_hWnd, text.c_str()); }
    std::string GetWindowText() const;
    int GetWindowTextLength() const { return ::GetWindowTextLengthA(m_hWnd); }
    CRect GetClientRect() const;
    void GetClientRect(LPRECT rc) const { ::GetClientRect(m_hWnd, rc); }
    CRect GetWindowRect() const;
    void GetWindowRect(LPRECT rc) const { ::GetWindowRect(m_hWnd, rc); }
    void ScreenToClient(LPPOINT pt) const { ::ScreenToClient(m_hWnd, pt); }
    void ScreenToClient(LPRECT rc) const {
        ::MapWindowPoints(nullptr, m_hWnd, reinterpret_cast<POINT*>(rc), 2);
    }
    void ClientToScreen(LPPOINT pt) const { ::ClientToScreen(m_hWnd, pt); }
    void ClientToScreen(LPRECT rc) const {
        ::MapWindowPoints(m_hWnd, nullptr, reinterpret_cast<POINT*>(rc), 2);
    }
    void Invalidate(bool erase = true) { ::InvalidateRect(m_hWnd, nullptr, erase); }
    void InvalidateRect(const RECT* rc, bool erase = true) { ::InvalidateRect(m_hWnd, rc, erase); }
    void UpdateWindow() { ::UpdateWindow(m_hWnd); }
    bool RedrawWindow(const RECT* rc = nullptr, HRGN rgn = nullptr,
                      UINT flags = RDW_INVALIDATE | RDW_UPDATENOW | RDW_ERASE) {
        return ::RedrawWindow(m_hWnd, rc, rgn, flags) != FALSE;
    }
    CWnd* SetFocus();
    HWND SetFocusHwnd() { return ::SetFocus(m_hWnd); }
    static CWnd* GetFocus() { return FromHandle(::GetFocus()); }
    bool EnableWindow(bool enable = true) { return ::EnableWindow(m_hWnd, enable) != FALSE; }
    bool IsWindowEnabled() const { return ::IsWindowEnabled(m_hWnd) != FALSE; }
    bool IsWindowVisible() const { return ::IsWindowVisible(m_hWnd) != FALSE; }
    bool IsWindow() const { return m_hWnd && ::IsWindow(m_hWnd); }
    LRESULT SendMessage(UINT message, WPARAM wParam = 0, LPARAM lParam = 0) const {
        return ::SendMessageA(m_hWnd, message, wParam, lParam);
    }
    bool PostMessage(UINT message, WPARAM wParam = 0, LPARAM lParam = 0) const {
        return ::PostMessageA(m_hWnd, message, wParam, lParam) != FALSE;
    }
    CWnd* GetParent() const { return FromHandle(::GetParent(m_hWnd)); }
    HWND GetParentHwnd() const { return ::GetParent(m_hWnd); }
    CWnd* GetTopLevelParent() const { return FromHandle(::GetAncestor(m_hWnd, GA_ROOT)); }
    HWND GetDlgItem(int id) const { return ::GetDlgItem(m_hWnd, id); }
    std::string GetDlgItemText(int id) const;
    void SetDlgItemText(int id, const std::string& text) { ::SetDlgItemTextA(m_hWnd, id, text.c_str()); }
    // The check state of a dialog's check box or radio button (BST_CHECKED, ...).
    UINT IsDlgButtonChecked(int id) const { return ::IsDlgButtonChecked(m_hWnd, id); }
    void CheckDlgButton(int id, UINT check) { ::CheckDlgButton(m_hWnd, id, check); }
    int GetDlgCtrlID() const { return ::GetDlgCtrlID(m_hWnd); }
    DWORD GetStyle() const { return static_cast<DWORD>(::GetWindowLongPtrA(m_hWnd, GWL_STYLE)); }
    DWORD GetExStyle() const { return static_cast<DWORD>(::GetWindowLongPtrA(m_hWnd, GWL_EXSTYLE)); }
    bool ModifyStyle(DWORD remove, DWORD add, UINT swpFlags = 0);
    UINT_PTR SetTimer(UINT_PTR id, UINT elapse) { return ::SetTimer(m_hWnd, id, elapse, nullptr); }
    bool KillTimer(UINT_PTR id) { return ::KillTimer(m_hWnd, id) != FALSE; }
    void SetFont(HFONT font, bool redraw = true) {
        SendMessage(WM_SETFONT, reinterpret_cast<WPARAM>(font), redraw);
    }
    HFONT GetFont() const { return reinterpret_cast<HFONT>(SendMessage(WM_GETFONT)); }
    HMENU GetMenu() const { return ::GetMenu(m_hWnd); }
    bool SetMenu(HMENU menu) { return ::SetMenu(m_hWnd, menu) != FALSE; }
    void DrawMenuBar() { ::DrawMenuBar(m_hWnd); }
    HWND SetCapture() { return ::SetCapture(m_hWnd); }
    bool SetForegroundWindow() { return ::SetForegroundWindow(m_hWnd) != FALSE; }
    void BringWindowToTop() { ::BringWindowToTop(m_hWnd); }
    void CenterWindow(HWND alternateOwner = nullptr);
    bool ShowScrollBar(int bar, bool show = true) { return ::ShowScrollBar(m_hWnd, bar, show) != FALSE; }
    int GetScrollPos(int bar) const { return ::GetScrollPos(m_hWnd, bar); }
    int SetScrollPos(int bar, int pos, bool redraw = true) {
        return ::SetScrollPos(m_hWnd, bar, pos, redraw);
    }
    bool ScrollWindow(int dx, int dy, const RECT* rc = nullptr, const RECT* clip = nullptr) {
        return ::ScrollWindow(m_hWnd, dx, dy, rc, clip) != FALSE;
    }

protected:
    // Handlers of WindowProc; each base version does the default processing.
    virtual int OnCreate(LPCREATESTRUCTA cs);
    virtual void OnDestroy() { Default(); }
    virtual void OnNcDestroy() { Default(); }
    virtual void OnClose() { Default(); }
    virtual void OnSize(UINT type, int cx, int cy) { Default(); }
    virtual void OnMove(int x, int y) { Default(); }
    virtual void OnPaint() { Default(); }
    virtual bool OnEraseBkgnd(CDC* pDC) { return Default() != 0; }
    virtual void OnTimer(UINT_PTR id) { Default(); }
    virtual void OnSetFocus(HWND oldWnd) { Default(); }
    virtual void OnKillFocus(HWND newWnd) { Default(); }
    virtual void OnKeyDown(UINT nChar, UINT repeat, UINT flags) { Default(); }
    virtual void OnKeyUp(UINT nChar, UINT repeat, UINT flags) { Default(); }
    virtual void OnChar(UINT nChar, UINT repeat, UINT flags) { Default(); }
    virtual void OnMouseMove(UINT flags, CPoint pt) { Default(); }
    virtual void OnLButtonDown(UINT flags, CPoint pt) { Default(); }
    virtual void OnLButtonUp(UINT flags, CPoint pt) { Default(); }
    virtual void OnLButtonDblClk(UINT flags, CPoint pt) { Default(); }
    virtual void OnRButtonDown(UINT flags, CPoint pt) { Default(); }
    virtual void OnRButtonUp(UINT flags, CPoint pt) { Default(); }
    virtual bool OnMouseWheel(UINT flags, short delta, CPoint pt) { return Default() != 0; }
    virtual void OnContextMenu(HWND wnd, CPoint pt) { Default(); }
    virtual bool OnSetCursor(HWND wnd, UINT hitTest, UINT message) { return Default() != 0; }
    virtual void OnHScroll(UINT code, UINT pos, HWND scrollBar) { Default(); }
    virtual void OnVScroll(UINT code, UINT pos, HWND scrollBar) { Default(); }
    virtual void OnShowWindow(bool show, UINT status) { Default(); }
    virtual void OnGetMinMaxInfo(MINMAXINFO* mmi) { Default(); }
    virtual void OnInitMenuPopup(HMENU popup, UINT index, bool sysMenu);
    virtual void OnMenuSelect(UINT itemId, UINT flags, HMENU menu) { Default(); }
    virtual void OnActivate(UINT state, HWND other, bool minimized) { Default(); }
    // WM_COMMAND: control notifications go to the control first, the rest to OnCmdMsg.
    virtual bool OnCommand(WPARAM wParam, LPARAM lParam);
    // WM_NOTIFY: offered to the sending control's wrapper first.
    virtual bool OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult);

    // Reflected notifications, called by the base OnChildNotify; true when handled.
    virtual bool OnCommandReflect(UINT code) { return false; }
    virtual bool OnNotifyReflect(NMHDR* pNMHDR, LRESULT* pResult) { return false; }
    // A colour message for this control: return a brush to use, nullptr for the default.
    virtual HBRUSH OnCtlColorReflect(HDC hdc, UINT message) { return nullptr; }

    // The message being handled, for Default().
    struct CurrentMessage {
        UINT message = 0;
        WPARAM wParam = 0;
        LPARAM lParam = 0;
    };
    const CurrentMessage& GetCurrentMessage() const { return m_current; }

private:
    friend LRESULT CALLBACK AfxWndProc(HWND, UINT, WPARAM, LPARAM);
    friend INT_PTR CALLBACK AfxDlgProc(HWND, UINT, WPARAM, LPARAM);
    friend class CDialog;
    void Bind(HWND hwnd);
    void Unbind();
    // One message being handled by this object. Handlers nest (a message sent while another is handled),
    // and any of them may destroy the window and with it an object that deletes itself in PostNcDestroy:
    // the destructor marks every open dispatch, and a marked one touches the object no more.
    struct Dispatch {
        Dispatch* outer = nullptr;
        bool objectGone = false;
    };
    // Handles one message; `objectGone` is set when the object was deleted while handling it.
    LRESULT DispatchGuarded(UINT message, WPARAM wParam, LPARAM lParam, bool& objectGone);

protected:
    // Watches this object through a call that may delete it (a creation that fails destroys its window,
    // and a frame deletes itself with its window): Gone() says whether it did. Lives on the caller's stack,
    // marked by the destructor like a message being handled.
    class LifetimeWatch {
    public:
        explicit LifetimeWatch(CWnd& wnd) : m_wnd(wnd) {
            m_entry.outer = wnd.m_pDispatch;
            wnd.m_pDispatch = &m_entry;
        }
        ~LifetimeWatch() {
            if (!m_entry.objectGone)
                m_wnd.m_pDispatch = m_entry.outer;
        }
        LifetimeWatch(const LifetimeWatch&) = delete;
        LifetimeWatch& operator=(const LifetimeWatch&) = delete;
        bool Gone() const { return m_entry.objectGone; }

    private:
        CWnd& m_wnd;
        Dispatch m_entry;
    };

private:
    WNDPROC m_pfnSuper = nullptr; // the procedure Default() calls: DefWindowProc or the original one
    bool m_bBound = false;
    CurrentMessage m_current;
    Dispatch* m_pDispatch = nullptr; // the innermost message being handled, or nullptr
};

// What a window procedure answers for a message whose handler threw: creation fails (WM_NCCREATE FALSE,
// WM_CREATE -1); every other message gets 0, the answer of "not handled" for nearly all of them.
LRESULT AfxFailureResult(UINT message);

LRESULT CALLBACK AfxWndProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam);

// ---- CWinApp ----------------------------------------------------------------------------------------

// One global object per module. Its constructor makes it the module's application.
class CWinApp {
public:
    explicit CWinApp(const char* appName = nullptr);
    virtual ~CWinApp();
    CWinApp(const CWinApp&) = delete;
    CWinApp& operator=(const CWinApp&) = delete;

    virtual bool InitInstance() { return true; }
    virtual int ExitInstance() { return 0; }
    // Idle work after a modal loop's queue empties; return true to be called again before waiting.
    virtual bool OnIdle(long count);

    // Loads a string resource of the module; empty when it does not exist.
    static std::string LoadString(UINT id);

    CWnd* m_pMainWnd = nullptr;
    std::string m_strAppName;
    HINSTANCE m_hInstance = nullptr;
};

// ---- CDialog ----------------------------------------------------------------------------------------

class CDialog : public CWnd {
public:
    explicit CDialog(UINT templateId = 0, CWnd* parent = nullptr)
        : m_nIDTemplate(templateId), m_pParentWnd(parent) {}

    // Runs the dialog modally in the framework's own loop (PreTranslateMessage is called for every
    // message, update handlers run on idle). Returns the value given to EndDialog, -1 on failure.
    virtual INT_PTR DoModal();
    // Creates the dialog modeless.
    bool Create(UINT templateId, CWnd* parent = nullptr);
    // Ends a modal run with this result; hides a modeless dialog.
    void EndDialog(INT_PTR result);

    virtual bool OnInitDialog() { return true; }
    virtual void OnOK() { EndDialog(IDOK); }
    virtual void OnCancel() { EndDialog(IDCANCEL); }

    bool IsModalRunning() const { return m_bModalRunning; }
    // Whether a modal run that this one's run interrupted has been ended: the nested run then ends as
    // cancelled at once.
    bool OuterRunEnded() const;

protected:
    bool OnCommand(WPARAM wParam, LPARAM lParam) override;
    HWND OwnerWindow() const;

    UINT m_nIDTemplate;
    CWnd* m_pParentWnd;
    // How DoModal shows the dialog once it is initialised: a dialog that only carries a loop for another
    // window shows itself without taking the activation (and the keyboard) from that window.
    int m_nShowCommand = SW_SHOWNORMAL;

private:
    friend INT_PTR CALLBACK AfxDlgProc(HWND, UINT, WPARAM, LPARAM);
    bool m_bModalRunning = false;
    INT_PTR m_nModalResult = -1;
    CDialog* m_pOuterModal = nullptr; // the modal run this one's run interrupted, while it runs
};

// ---- controls ---------------------------------------------------------------------------------------

class CEdit : public CWnd {
public:
    bool Create(DWORD style, const RECT& rect, CWnd* parent, UINT id) {
        return CreateEx(0, "EDIT", "", style, rect, parent, id);
    }
    void SetSel(int start, int end, bool noScroll = false) {
        SendMessage(EM_SETSEL, static_cast<WPARAM>(start), end);
        if (!noScroll)
            SendMessage(EM_SCROLLCARET);
    }
    void GetSel(int& start, int& end) const {
        DWORD s = 0, e = 0;
        SendMessage(EM_GETSEL, reinterpret_cast<WPARAM>(&s), reinterpret_cast<LPARAM>(&e));
        start = static_cast<int>(s);
        end = static_cast<int>(e);
    }
    void ReplaceSel(const std::string& text, bool canUndo = false) {
        SendMessage(EM_REPLACESEL, canUndo, reinterpret_cast<LPARAM>(text.c_str()));
    }
    bool SetReadOnly(bool readOnly = true) { return SendMessage(EM_SETREADONLY, readOnly) != 0; }
    void LimitText(int chars) { SendMessage(EM_LIMITTEXT, static_cast<WPARAM>(chars)); }
    void Clear() { SendMessage(WM_CLEAR); }
    void Copy() { SendMessage(WM_COPY); }
    void Cut() { SendMessage(WM_CUT); }
    void Paste() { SendMessage(WM_PASTE); }
};

class CStatic : public CWnd {
public:
    bool Create(const char* text, DWORD style, const RECT& rect, CWnd* parent, UINT id = 0xFFFF) {
        return CreateEx(0, "STATIC", text, style, rect, parent, id);
    }
};

// A push button, check box or radio button. The check state is BST_UNCHECKED, BST_CHECKED or
// BST_INDETERMINATE.
class CButton : public CWnd {
public:
    bool Create(const char* text, DWORD style, const RECT& rect, CWnd* parent, UINT id) {
        return CreateEx(0, "BUTTON", text, style, rect, parent, id);
    }
    int GetCheck() const { return static_cast<int>(SendMessage(BM_GETCHECK)); }
    void SetCheck(int check) { SendMessage(BM_SETCHECK, static_cast<WPARAM>(check)); }
    bool IsChecked() const { return GetCheck() == BST_CHECKED; }
};

// ---- CMenu ------------------------------------------------------------------------------------------

// Holds a menu handle. A loaded or created menu is owned and destroyed with the object; a submenu
// (GetSubMenu) or an attached one belongs to its parent and is not. Move-only.
class CMenu {
public:
    CMenu() = default;
    ~CMenu() { DestroyMenu(); }
    CMenu(const CMenu&) = delete;
    CMenu& operator=(const CMenu&) = delete;
    CMenu(CMenu&& o) noexcept : m_hMenu(o.m_hMenu), m_bOwned(o.m_bOwned) { o.m_hMenu = nullptr; }
    CMenu& operator=(CMenu&& o) noexcept;

    HMENU m_hMenu = nullptr;
    HMENU GetSafeHmenu() const { return m_hMenu; }
    operator HMENU() const { return m_hMenu; }

    bool LoadMenu(UINT resourceId);
    bool CreatePopupMenu();
    // Non-owning.
    void Attach(HMENU menu);
    HMENU Detach();
    bool DestroyMenu();

    CMenu GetSubMenu(int position) const;
    int GetMenuItemCount() const { return ::GetMenuItemCount(m_hMenu); }
    UINT GetMenuItemID(int position) const { return ::GetMenuItemID(m_hMenu, position); }
    UINT GetMenuState(UINT id, UINT flags) const { return ::GetMenuState(m_hMenu, id, flags); }
    UINT CheckMenuItem(UINT id, UINT check) { return ::CheckMenuItem(m_hMenu, id, check); }
    UINT EnableMenuItem(UINT id, UINT enable) { return ::EnableMenuItem(m_hMenu, id, enable); }
    bool AppendMenu(UINT flags, UINT_PTR id = 0, const char* text = nullptr) {
        return ::AppendMenuA(m_hMenu, flags, id, text) != FALSE;
    }
    // Returns the chosen command with TPM_RETURNCMD, otherwise whether the menu was shown.
    int TrackPopupMenu(UINT flags, int x, int y, HWND owner) const {
        return static_cast<int>(::TrackPopupMenu(m_hMenu, flags, x, y, 0, owner, nullptr));
    }

private:
    bool m_bOwned = false;
};
