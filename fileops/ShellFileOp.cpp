#include "fileops/ShellFileOp.h"

#include "framework/afxwin.h"

CShellFileOp::CShellFileOp() = default;

CShellFileOp::CShellFileOp(HWND owner, int code, const char* source, const char* destination,
                           FILEOP_FLAGS flags, const char* progressTitle) {
    SetOwner(owner);
    AddName(kSource, source);
    AddName(kDestination, destination);
    SetProgressTitle(progressTitle);
    SetFlags(flags);
    switch (code) {
    case kMove:
        m_nResult = Move();
        break;
    case kCopy:
        m_nResult = Copy();
        break;
    case kDelete:
        m_nResult = Delete();
        break;
    case kRename:
        m_nResult = Rename();
        break;
    default:
        break;
    }
}

void CShellFileOp::AddName(int list, const char* name) {
    (list == kSource ? m_source : m_destination).Add(name);
}

void CShellFileOp::ClearList(int list) {
    (list == kSource ? m_source : m_destination).Clear();
}

void CShellFileOp::SetProgressTitle(const char* text) {
    m_strTitle = text ? text : "";
}

void CShellFileOp::SetProgressTitle(UINT stringId) {
    m_strTitle = CWinApp::LoadString(stringId);
}

int CShellFileOp::Run(UINT operation) {
    m_op.wFunc = operation;
    m_op.pFrom = m_source.Data();
    m_op.pTo = m_destination.Data();
    m_op.fAnyOperationsAborted = FALSE;
    m_op.hNameMappings = nullptr;
    m_op.lpszProgressTitle = m_strTitle.empty() ? nullptr : m_strTitle.c_str();
    // The shell refuses a missing source list; it is not asked at all.
    if (!m_op.pFrom)
        return ERROR_INVALID_PARAMETER;
    return ::SHFileOperationA(&m_op);
}

int CShellFileOp::Copy() {
    return Run(FO_COPY);
}

int CShellFileOp::Move() {
    return Run(FO_MOVE);
}

int CShellFileOp::Delete() {
    // Never FOF_NOCONFIRMATION: the user confirms, and the files go to the Recycle Bin.
    m_op.fFlags = FOF_ALLOWUNDO;
    return Run(FO_DELETE);
}

int CShellFileOp::Rename() {
    return Run(FO_RENAME);
}
