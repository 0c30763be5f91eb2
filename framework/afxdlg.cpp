// CDialog: modal runs in the framework's own loop, modeless creation.
//
// The dialog is created modeless by the dialog manager with AfxDlgProc, which binds the object on
// WM_INITDIALOG and subclasses the dialog window with AfxWndProc: from then on every message goes
// through CDialog::WindowProc, and Default() hands it back to the dialog manager (whose call of
// AfxDlgProc answers FALSE, meaning "default dialog processing").
#include "afxwin.h"

INT_PTR CALLBACK AfxDlgProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message != WM_INITDIALOG || CWnd::FromHandle(hwnd))
        return FALSE;
    auto* pDlg = reinterpret_cast<CDialog*>(lParam);
    if (!pDlg)
        return FALSE;
    pDlg->SubclassWindow(hwnd);
    CWnd::CurrentMessage saved = pDlg->m_current;
    pDlg->m_current = {message, wParam, lParam};
    INT_PTR result = TRUE;
    try {
        result = pDlg->OnInitDialog() ? TRUE : FALSE;
    } catch (...) {
        AfxReportCurrentException();
        // A dialog that failed to initialise is not left standing half made: a modal run ends at once.
        pDlg->EndDialog(-1);
    }
    pDlg->m_current = saved;
    return result;
}

HWND CDialog::OwnerWindow() const {
    HWND owner = nullptr;
    if (m_pParentWnd && m_pParentWnd->m_hWnd)
        owner = m_pParentWnd->m_hWnd;
    else if (CWnd* pMain = AfxGetMainWnd(); pMain && pMain != this && pMain->m_hWnd)
        owner = pMain->m_hWnd;
    else
        owner = ::GetActiveWindow();
    // The owner of a dialog is always a top-level window.
    return owner ? ::GetAncestor(owner, GA_ROOT) : nullptr;
}

bool CDialog::Create(UINT templateId, CWnd* parent) {
    if (m_hWnd)
        return false;
    m_nIDTemplate = templateId;
    m_pParentWnd = parent;
    HWND hwnd = ::CreateDialogParamA(AfxGetResourceHandle(), MAKEINTRESOURCEA(templateId), OwnerWindow(),
                                     AfxDlgProc, reinterpret_cast<LPARAM>(this));
    return hwnd != nullptr && m_hWnd == hwnd;
}

namespace {
// The innermost modal run of this thread; each run keeps the one it interrupted.
thread_local CDialog* t_pInnermostModal = nullptr;
} // namespace

bool CDialog::OuterRunEnded() const {
    for (const CDialog* outer = m_pOuterModal; outer; outer = outer->m_pOuterModal)
        if (!outer->m_bModalRunning)
            return true;
    return false;
}

INT_PTR CDialog::DoModal() {
    if (m_hWnd || m_bModalRunning)
        return -1;
    // Unwinds the modal chain on every way out.
    struct ModalLink {
        CDialog* self;
        explicit ModalLink(CDialog* dialog) : self(dialog) {
            self->m_pOuterModal = t_pInnermostModal;
            t_pInnermostModal = self;
        }
        ~ModalLink() {
            t_pInnermostModal = self->m_pOuterModal;
            self->m_pOuterModal = nullptr;
        }
    } link(this);
    HWND owner = OwnerWindow();
    // Whether the owner takes input is read before the dialog exists: its initialisation may disable the
    // owner itself (the explorer disables the host's frame), and the owner gets back what it had.
    const bool ownerWasEnabled = owner && ::IsWindowEnabled(owner);
    m_nModalResult = -1;
    m_bModalRunning = true; // EndDialog inside OnInitDialog must already end the run
    HWND hwnd = ::CreateDialogParamA(AfxGetResourceHandle(), MAKEINTRESOURCEA(m_nIDTemplate), owner,
                                     AfxDlgProc, reinterpret_cast<LPARAM>(this));
    if (!hwnd) {
        m_bModalRunning = false;
        if (ownerWasEnabled)
            ::EnableWindow(owner, TRUE);
        return -1;
    }
    if (ownerWasEnabled)
        ::EnableWindow(owner, FALSE);
    if (m_bModalRunning && m_hWnd)
        ::ShowWindow(m_hWnd, m_nShowCommand);

    bool idle = true;
    long idleCount = 0;
    while (m_bModalRunning && m_hWnd) {
        // A run this one interrupted has been ended (its owner's result came in meanwhile): this one
        // ends too, as cancelled, so that the outer loop can return.
        if (OuterRunEnded()) {
            if (m_nModalResult == -1)
                m_nModalResult = IDCANCEL;
            break;
        }
        MSG msg;
        // Idle work once the queue has emptied: update handlers grey and check buttons.
        while (idle && !::PeekMessageA(&msg, nullptr, 0, 0, PM_NOREMOVE)) {
            try {
                CWinApp* pApp = AfxGetApp();
                idle = pApp ? pApp->OnIdle(idleCount++) : (AfxIdleUpdateCmdUI(), false);
            } catch (...) {
                AfxReportCurrentException();
                idle = false;
            }
            if (!m_bModalRunning || !m_hWnd)
                break;
        }
        if (!m_bModalRunning || !m_hWnd)
            break;
        if (::GetMessageA(&msg, nullptr, 0, 0) <= 0) {
            ::PostQuitMessage(static_cast<int>(msg.wParam)); // let the outer loop see WM_QUIT too
            if (m_nModalResult == -1)
                m_nModalResult = IDCANCEL;
            break;
        }
        bool handled = false;
        try {
            handled = AfxPreTranslateMessage(&msg, this);
        } catch (...) {
            AfxReportCurrentException();
            handled = true;
        }
        if (!handled && !(m_hWnd && ::IsDialogMessageA(m_hWnd, &msg))) {
            ::TranslateMessage(&msg);
            ::DispatchMessageA(&msg);
        }
        if (msg.message != WM_TIMER && msg.message != WM_MOUSEMOVE && msg.message != WM_NCMOUSEMOVE) {
            idle = true;
            idleCount = 0;
        }
    }
    m_bModalRunning = false;

    // The owner takes the activation back before the dialog goes away, so it does not flash behind.
    if (ownerWasEnabled)
        ::EnableWindow(owner, TRUE);
    if (m_hWnd) {
        if (owner && ::GetActiveWindow() == m_hWnd)
            ::SetActiveWindow(owner);
        ::SetWindowPos(m_hWnd, nullptr, 0, 0, 0, 0,
                       SWP_HIDEWINDOW | SWP_NOSIZE | SWP_NOMOVE | SWP_NOACTIVATE | SWP_NOZORDER);
        DestroyWindow();
    }
    return m_nModalResult;
}

void CDialog::EndDialog(INT_PTR result) {
    m_nModalResult = result;
    if (m_bModalRunning) {
        m_bModalRunning = false;
        ::PostMessageA(m_hWnd, WM_NULL, 0, 0); // wakes the loop if it waits
    } else if (m_hWnd) {
        ::ShowWindow(m_hWnd, SW_HIDE);
    }
}

bool CDialog::OnCommand(WPARAM wParam, LPARAM lParam) {
    if (CWnd::OnCommand(wParam, lParam))
        return true;
    if (HIWORD(wParam) != BN_CLICKED && lParam)
        return false;
    switch (LOWORD(wParam)) {
    case IDOK:
        OnOK();
        return true;
    case IDCANCEL:
        OnCancel();
        return true;
    default:
        return false;
    }
}
