#include "thumbs/AppMessages.h"

#include "framework/afxwin.h"

bool PostAppResult(AppResult result) {
    CWnd* main = AfxGetMainWnd();
    return main && main->m_hWnd && main->PostMessage(WM_ORVEX_RESULT, static_cast<WPARAM>(result));
}
