#include "host/DialogRun.h"

#include "host/ArxApp.h"

CDialogRun::~CDialogRun() {
    if (theApp.m_pMainWnd == this)
        theApp.m_pMainWnd = nullptr;
}

bool CDialogRun::OnInitDialog() {
    CDialog::OnInitDialog();
    // The explorer is placed from this dialog's rectangle, so it is created before the dialog shrinks.
    theApp.CreateAndShow(this);
    // The dialog only carries the loop: it shrinks to nothing in the corner.
    ::MoveWindow(m_hWnd, 0, 0, 0, 0, TRUE);
    // A fixed double-click time for the thumbnails' clicks; this is the desktop's setting.
    ::SetDoubleClickTime(300);
    return true;
}

bool CDialogRun::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message == WM_ORVEX_RESULT)
        EndDialog(static_cast<INT_PTR>(pMsg->wParam));
    return CDialog::PreTranslateMessage(pMsg);
}
