#include "host/DialogRun.h"

#include "frame/MdiMixin.h"
#include "hostapi/HostApi.h"
#include "hostapi/NarrowText.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DrawingFolder.h"

#include <string>

namespace {

// Why the chosen drawing cannot be handed back, or empty when it can.
std::string PickRefusal(const DrawingFolder& folder) {
    const std::string drawing = folder.ChosenPath();
    const std::string name = folder.ChosenName();
    const DWORD attributes = ::GetFileAttributesA(drawing.c_str());
    // A file listed once under a name without the code page's '?' is the one the user chose: no need
    // to read the folder again (it may hold a million files).
    if (attributes != INVALID_FILE_ATTRIBUTES && !(attributes & FILE_ATTRIBUTE_DIRECTORY) &&
        folder.CountNamed(name) == 1 && name.find('?') == std::string::npos)
        return {};
    const std::string head = "The drawing\n" + drawing + "\n";
    switch (CheckPickedName(folder.Folder(), name)) {
    case PickedName::NotInCodePage:
        // Its narrow name is a best fit ('l' for a Polish l with stroke) or question marks: the path
        // would name another file or none.
        return head + "cannot be given back: the system's code page cannot hold the letters of its name, or "
                      "of another file's name shown the same. Rename the file and choose it again.";
    case PickedName::Ambiguous:
        return head + "cannot be given back: another file of the folder has the same name in other "
                      "letter case. Rename one of them and choose again.";
    case PickedName::Missing:
    case PickedName::Exact:
        break;
    }
    if (attributes == INVALID_FILE_ATTRIBUTES) // deleted or moved while the window was open
        return head + "no longer exists. Choose another one.";
    if (attributes & FILE_ATTRIBUTE_DIRECTORY) // a folder whose name begins with a dot is listed too
        return head + "is a folder, not a drawing. Choose another one.";
    return {};
}

} // namespace

CDialogRun::~CDialogRun() {
    if (m_app.m_pMainWnd == this)
        m_app.m_pMainWnd = nullptr;
}

bool CDialogRun::OnInitDialog() {
    CDialog::OnInitDialog();
    // The explorer is placed from this dialog's rectangle, so it is created before the dialog shrinks.
    if (!m_app.CreateAndShow(this, m_call)) {
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
            const DrawingFolder* folder = m_app.Folder();
            if (!folder || folder->Chosen() < 0) {
                EndDialog(kAppCancel); // accept with nothing chosen: the call returns nil
                return true;
            }
            // The path must name the file the user chose, or the user is told and chooses again.
            const std::string refused = PickRefusal(*folder);
            if (!refused.empty()) {
                HWND owner = ::GetActiveWindow();
                const std::string fitted = BreakLongWords(refused, kMessageWordChars);
                ::MessageBoxA(owner ? owner : m_hWnd, fitted.c_str(), "Orvex1", MB_OK | MB_ICONWARNING);
                return true;
            }
        }
        EndDialog(static_cast<INT_PTR>(pMsg->wParam));
        return true;
    }
    return CDialog::PreTranslateMessage(pMsg);
}
