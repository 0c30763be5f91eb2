// The search edit of the top toolbar.
#include "frame/MainFrame.h"

#include "thumbs/AppMessages.h"

bool CEditSearch::OnCommandReflect(UINT code) {
    if (code != EN_CHANGE)
        return false;
    // Search as you type: the grid selects and shows the first drawing whose name starts with the text.
    if (onSearch)
        onSearch(GetWindowText());
    return true;
}

LRESULT CEditSearch::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_KEYDOWN:
        if (wParam == VK_ESCAPE) {
            PostAppResult(kAppCancel);
            return 0;
        }
        if (wParam == VK_RETURN) {
            if (onAccept)
                onAccept();
            return 0;
        }
        if (wParam == 'A' && (::GetKeyState(VK_CONTROL) & 0x8000) && !(::GetKeyState(VK_MENU) & 0x8000)) {
            SetSel(0, -1); // select all of the text, as edit boxes do
            return 0;
        }
        break;
    case WM_CHAR:
        // The edit would beep at the escape character (the key has already cancelled), at Enter's and at
        // Ctrl+A's.
        if (wParam == VK_ESCAPE || wParam == '\r' || wParam == 0x01)
            return 0;
        break;
    case WM_LBUTTONDOWN:
        // A click starts a new search: the edit becomes writable and empty, then takes the click.
        SendMessage(EM_SETREADONLY, FALSE);
        SetWindowText("");
        break;
    default:
        break;
    }
    return CEdit::WindowProc(message, wParam, lParam);
}
