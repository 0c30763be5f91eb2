// The shell's file operation (SHFileOperationA) with its two name lists. One lives on the stack of one
// command: fill the lists, set the flags, run. Copying, moving, recycling and renaming all go through the
// shell, so its confirmations (replace a file? send to the Recycle Bin?) and its progress are the user's.
#pragma once

#include "fileops/NameList.h"

#include <windows.h>
#include <shellapi.h>

#include <string>

class CShellFileOp {
public:
    enum List { kSource = 0, kDestination = 1 };
    // Codes of the all-in-one constructor.
    enum Code { kMove = 1, kCopy = 2, kDelete = 3, kRename = 4 };

    CShellFileOp();
    // Fills both lists with one name each, sets the title and runs the operation of code at once (any other
    // code runs nothing); Result() tells how it went.
    CShellFileOp(HWND owner, int code, const char* source, const char* destination, FILEOP_FLAGS flags,
                 const char* progressTitle);
    ~CShellFileOp() = default;
    CShellFileOp(const CShellFileOp&) = delete;
    CShellFileOp& operator=(const CShellFileOp&) = delete;

    void AddName(int list, const char* name);
    void AddName(int list, const std::string& name) { AddName(list, name.c_str()); }
    void ClearList(int list);
    // An empty text leaves no title.
    void SetProgressTitle(const char* text);
    void SetProgressTitle(UINT stringId);
    void SetFlags(FILEOP_FLAGS flags) { m_op.fFlags = flags; }
    FILEOP_FLAGS GetFlags() const { return m_op.fFlags; }
    void SetOwner(HWND owner) { m_op.hwnd = owner; }
    bool Aborted() const { return m_op.fAnyOperationsAborted != FALSE; }

    const NameList& Source() const { return m_source; }
    const NameList& Destination() const { return m_destination; }

    // Each returns the SHFileOperationA result: 0 when it went well.
    int Copy();
    int Move();
    // To the Recycle Bin (FOF_ALLOWUNDO), after the shell's own confirmation.
    int Delete();
    int Rename();
    // The result of the all-in-one constructor's operation (-1 when it ran none).
    int Result() const { return m_nResult; }

private:
    int Run(UINT operation);

    NameList m_source;
    NameList m_destination;
    SHFILEOPSTRUCTA m_op{};
    std::string m_strTitle;
    int m_nResult = -1;
};
