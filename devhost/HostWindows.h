// The host's windows: the main frame and one drawing view per open document (only the active one
// visible). Each window object is bound to its HWND through GWLP_USERDATA.
#pragma once

#include <windows.h>

#include <functional>
#include <string>

namespace devhost {

extern const wchar_t* const kFrameClass; // "DevhostFrame"
extern const wchar_t* const kViewClass;  // "DevhostDrawingView"

class HostWindow {
public:
    HostWindow() = default;
    HostWindow(const HostWindow&) = delete;
    HostWindow& operator=(const HostWindow&) = delete;
    virtual ~HostWindow() = default;

    HWND Handle() const { return m_hwnd; }

    // The window procedure of every host class.
    static LRESULT CALLBACK Procedure(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam);

protected:
    virtual LRESULT HandleMessage(UINT message, WPARAM wParam, LPARAM lParam);

    HWND m_hwnd = nullptr;
};

// Posted to the main frame by the script's `call` command: lParam is a new std::wstring holding the LISP
// text, which the frame takes over.
constexpr UINT WM_DEVHOST_CALL = WM_USER + 0x200;

// The main frame. The view windows are its children and go with it.
class FrameWindow final : public HostWindow {
public:
    bool Create();
    void Destroy();

    // Runs a call the script asked for (WM_DEVHOST_CALL), on the user-interface thread, whatever loop
    // dispatched the message: inside a running call that is the library's own loop.
    std::function<void(const std::wstring&)> onCall;

protected:
    LRESULT HandleMessage(UINT message, WPARAM wParam, LPARAM lParam) override;

private:
    void OnSize();
};

// Creates a drawing view in the frame (hidden); the frame owns it.
HWND CreateDrawingView(HWND frame, const std::wstring& documentName, int index);

// Shows the view and hides the other views of the frame, fitting it to the frame's client area.
void ShowOnlyView(HWND frame, HWND view);

bool RegisterHostClasses();

// Characters the drawing views received as keyboard input (WM_CHAR), kept for the script's `typed`
// command, which runs on another thread: it takes them and empties the record.
std::wstring TakeTypedText();

} // namespace devhost
