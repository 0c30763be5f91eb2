// The system's common file dialog (open or save) and the framework's message box.
#pragma once

#include "afxwin.h"

#include <commdlg.h>

#include <string>

class CFileDialog {
public:
    // openDialog false makes a save dialog. filter is in the framework's form: "Text|*.txt|All|*.*||".
    CFileDialog(bool openDialog, const char* defaultExtension = nullptr, const char* fileName = nullptr,
                DWORD flags = OFN_HIDEREADONLY | OFN_OVERWRITEPROMPT, const char* filter = nullptr,
                CWnd* parent = nullptr);
    CFileDialog(const CFileDialog&) = delete;
    CFileDialog& operator=(const CFileDialog&) = delete;

    // Runs the dialog; IDOK or IDCANCEL.
    INT_PTR DoModal();
    // The full path of the chosen file: what the file name field held when the dialog closed.
    std::string GetPathName() const { return m_strFile; }
    // The file name part of it.
    std::string GetFileName() const;

    // The dialog's title; empty gives the system's ("Save As", "Open").
    std::string m_strTitle;
    OPENFILENAMEA m_ofn{};

private:
    bool m_bOpen;
    std::string m_strDefExt;
    std::string m_strFilter; // with NULs in place of the bars
    std::string m_strFile;
    char m_szFile[MAX_PATH * 4] = "";
};

// A message box of the application: owner the active window (else the application's main window),
// caption the application's name. Returns the button chosen.
int AfxMessageBox(const std::string& text, UINT type = MB_OK, UINT helpId = 0);
