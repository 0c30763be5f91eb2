#include "afxfiledlg.h"

#include <commdlg.h>

#include <cstring>

CFileDialog::CFileDialog(bool openDialog, const char* defaultExtension, const char* fileName, DWORD flags,
                         const char* filter, CWnd* parent)
    : m_bOpen(openDialog) {
    if (defaultExtension)
        m_strDefExt = defaultExtension;
    if (filter) {
        m_strFilter = filter;
        for (char& c : m_strFilter)
            if (c == '|')
                c = '\0';
    }
    if (fileName) {
        std::strncpy(m_szFile, fileName, sizeof m_szFile - 1);
        m_szFile[sizeof m_szFile - 1] = '\0';
    }
    m_ofn.lStructSize = sizeof m_ofn;
    m_ofn.hwndOwner = parent ? parent->GetSafeHwnd() : nullptr;
    m_ofn.hInstance = AfxGetResourceHandle();
    m_ofn.Flags = flags | OFN_EXPLORER | OFN_ENABLESIZING;
}

INT_PTR CFileDialog::DoModal() {
    m_ofn.lpstrFile = m_szFile;
    m_ofn.nMaxFile = sizeof m_szFile;
    m_ofn.lpstrFilter = m_strFilter.empty() ? nullptr : m_strFilter.c_str();
    m_ofn.lpstrDefExt = m_strDefExt.empty() ? nullptr : m_strDefExt.c_str();
    m_ofn.lpstrTitle = m_strTitle.empty() ? nullptr : m_strTitle.c_str();
    if (!m_ofn.hwndOwner) {
        if (CWinApp* app = AfxGetApp(); app && app->m_pMainWnd)
            m_ofn.hwndOwner = app->m_pMainWnd->GetSafeHwnd();
    }
    const BOOL chosen = m_bOpen ? ::GetOpenFileNameA(&m_ofn) : ::GetSaveFileNameA(&m_ofn);
    // Whatever closed the dialog, the name field is read back (the buffer is left as it was on cancel).
    m_strFile = m_szFile;
    return chosen ? IDOK : IDCANCEL;
}

std::string CFileDialog::GetFileName() const {
    // The name after the last separator, walked by character in the ANSI code page: the second byte of a
    // double-byte character may be a backslash.
    std::size_t nameStart = 0;
    for (const char* p = m_strFile.c_str(); *p; p = ::CharNextA(p)) {
        // one byte: p is at the start of a character
        if (*p == '\\' || *p == '/')
            nameStart = static_cast<std::size_t>(p - m_strFile.c_str()) + 1;
    }
    return m_strFile.substr(nameStart);
}

int AfxMessageBox(const std::string& text, UINT type, UINT) {
    // The active window (the explorer's frame while it runs) takes no input while the box is up.
    HWND owner = ::GetActiveWindow();
    std::string caption;
    if (CWinApp* app = AfxGetApp()) {
        if (!owner && app->m_pMainWnd)
            owner = app->m_pMainWnd->GetSafeHwnd();
        caption = app->m_strAppName;
    }
    return ::MessageBoxA(owner, text.c_str(), caption.empty() ? nullptr : caption.c_str(), type);
}
