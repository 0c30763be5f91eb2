// Carries out a script (devhost/Script.h) on a thread of its own while the LISP call's modal loop runs
// on the user-interface thread: it finds the process's windows, moves and clicks the mouse and presses keys
// through the input queue (SendInput), and reports facts and screenshots on the command line.
#pragma once

#include "devhost/Script.h"

#include <windows.h>

#include <atomic>
#include <vector>

namespace devhost {

class ScriptRunner {
public:
    ScriptRunner(std::vector<ScriptCommand> commands, DWORD uiThreadId);
    ScriptRunner(const ScriptRunner&) = delete;
    ScriptRunner& operator=(const ScriptRunner&) = delete;
    ~ScriptRunner(); // waits for the thread

    bool Start();
    bool Started() const { return m_thread != nullptr; }
    HANDLE Thread() const { return m_thread; }
    bool Failed() const { return m_failed; }

private:
    static DWORD WINAPI ThreadProc(void* self);
    void Run();
    bool Execute(const ScriptCommand& command);

    std::vector<ScriptCommand> m_commands;
    DWORD m_uiThreadId;
    HANDLE m_thread = nullptr;
    std::atomic<bool> m_failed{false};
};

// The library's run dialog: an enabled top-level dialog (class #32770) of the thread, the one shrunk to
// nothing when there are several; nullptr when there is none.
HWND FindRunDialog(DWORD threadId);

// Ends the loops that run inside the call on top of the run dialog's, so that a posted cancel is seen: an
// open menu is cancelled, and each other visible dialog of the thread (a message box, the shell's
// confirmation, a file dialog, a property sheet) is answered with Cancel, else No, else OK. Callable from
// any thread. Returns how many it asked to end.
int EndNestedLoops(DWORD threadId);

} // namespace devhost
