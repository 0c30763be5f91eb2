#include "host/DialogRun.h"

#include "host/ArxApp.h"
#include "hostapi/HostApi.h"
#include "host/Orvex.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"

#include <string>

namespace {

// The drawing an accept would return: the document's folder and current name, or "" when none is chosen.
std::string ChosenDrawing() {
    if (!g_pTessel3Doc || g_pTessel3Doc->m_strName.empty())
        return {};
    std::string folder = g_pTessel3Doc->m_strPath;
    if (folder.empty() || folder.back() != '\\')
        folder += '\\';
    return folder + g_pTessel3Doc->m_strName;
}

bool IsExistingFile(const std::string& path) {
    const DWORD attributes = ::GetFileAttributesA(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && !(attributes & FILE_ATTRIBUTE_DIRECTORY);
}

// Copies of what the LISP function took from its arguments, for the explorer of this call.
ExplorerCall CallArguments() {
    ExplorerCall call;
    call.acceptCaption = g_szAcceptCaption;
    call.cancelCaption = g_szCancelCaption;
    call.startPath = g_szStartPath;
    call.startShellPath = g_szStartShellPath;
    call.hostFrame = acedGetAcadFrame();
    return call;
}

} // namespace

CDialogRun::~CDialogRun() {
    if (theApp.m_pMainWnd == this)
        theApp.m_pMainWnd = nullptr;
}

bool CDialogRun::OnInitDialog() {
    CDialog::OnInitDialog();
    // The explorer is placed from this dialog's rectangle, so it is created before the dialog shrinks.
    if (!theApp.CreateAndShow(this, CallArguments())) {
        // Nothing to show and nothing to wait for: an invisible loop would hold the host for good.
        acutPrintf(L"\nOrvex: the explorer window could not be created\n");
        EndDialog(kAppCancel);
        return true;
    }
    // The dialog only carries the loop: it shrinks to nothing in the corner.
    ::MoveWindow(m_hWnd, 0, 0, 0, 0, TRUE);
    // A fixed double-click time for the thumbnails' clicks; the run puts the user's own back at its end.
    ::SetDoubleClickTime(300);
    // The explorer has placed the keyboard focus (in its tree or its grid): the dialog takes none.
    return false;
}

bool CDialogRun::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message == WM_ORVEX_RESULT && pMsg->hwnd == m_hWnd) {
        // WM_APP is every program's first private message: one posted here by another program, with
        // meanings of its own, must not end the call. Only the explorer's two results, as PostAppResult
        // posts them (lParam 0), count; anything else is dropped.
        if ((pMsg->wParam != kAppAccept && pMsg->wParam != kAppCancel) || pMsg->lParam != 0)
            return true;
        if (pMsg->wParam == kAppAccept) {
            const std::string drawing = ChosenDrawing();
            if (drawing.empty()) {
                EndDialog(kAppCancel); // accept with nothing chosen: the call returns nil
                return true;
            }
            if (!IsExistingFile(drawing)) {
                // Deleted or moved while the window was open: say so and let the user choose again.
                const std::string text =
                    "The drawing\n" + drawing + "\nno longer exists. Choose another one.";
                HWND owner = ::GetActiveWindow();
                ::MessageBoxA(owner ? owner : m_hWnd, text.c_str(), "Orvex1", MB_OK | MB_ICONWARNING);
                return true;
            }
        }
        EndDialog(static_cast<INT_PTR>(pMsg->wParam));
        return true;
    }
    return CDialog::PreTranslateMessage(pMsg);
}
