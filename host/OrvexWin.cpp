#include "host/OrvexWin.h"

#include "frame/MdiMixin.h"
#include "host/DialogRun.h"
#include "tree/StartShellPath.h"
#include "hostapi/HostApi.h"
#include "settings/Tessel3Doc.h"

#include <shellapi.h>
#include <shlobj.h>
#include <shlwapi.h>

#include <cstdlib>
#include <cstring>

namespace {

// What a run changes of the host and the desktop, put back when it ends however it ends: the host's
// main frame takes input exactly as before (the explorer disables it while it is open), and the
// desktop's double-click time is the user's own again (the thumbnails run with 300 ms).
class HostInputRestorer {
public:
    HostInputRestorer()
        : m_frame(acedGetAcadFrame()), m_frameWasEnabled(m_frame && ::IsWindowEnabled(m_frame)),
          m_doubleClickTime(::GetDoubleClickTime()) {}
    HostInputRestorer(const HostInputRestorer&) = delete;
    HostInputRestorer& operator=(const HostInputRestorer&) = delete;
    ~HostInputRestorer() {
        if (::GetDoubleClickTime() != m_doubleClickTime)
            ::SetDoubleClickTime(m_doubleClickTime);
        if (m_frame && ::IsWindow(m_frame) && (::IsWindowEnabled(m_frame) != FALSE) != m_frameWasEnabled)
            ::EnableWindow(m_frame, m_frameWasEnabled);
    }

private:
    HWND m_frame;
    bool m_frameWasEnabled;
    UINT m_doubleClickTime;
};

// What the explorer of this call is given: the LISP function's arguments and the host's frame.
ExplorerCall CallArguments(const PickerArguments& arguments) {
    ExplorerCall call;
    call.acceptCaption = arguments.acceptCaption;
    call.cancelCaption = arguments.cancelCaption;
    call.startPath = arguments.startPath;
    call.startShellPath = arguments.startShellPath;
    call.hostFrame = acedGetAcadFrame();
    return call;
}

class WindowsPickerPlatform : public PickerPlatform {
public:
    explicit WindowsPickerPlatform(CMdiMixin& app) : m_app(app) {}

    std::string StartShellPath(const std::string& path) override { return StartShellPathOf(path); }

    std::string WholeStartPath(const std::string& path) override {
        if (!::PathIsRelativeA(path.c_str()) &&
            // one byte: after "C:" the third byte starts a character (":" is never a second byte)
            !(path.size() > 1 && path[1] == ':' && (path.size() == 2 || (path[2] != '\\' && path[2] != '/'))))
            return path; // "C:\x\", "\\server\share\": whole already ("C:x" is relative to C:'s folder)
        const DWORD needed = ::GetFullPathNameA(path.c_str(), 0, nullptr, nullptr);
        if (needed == 0)
            return path;
        std::string whole(needed, '\0');
        const DWORD written = ::GetFullPathNameA(path.c_str(), needed, whole.data(), nullptr);
        if (written == 0 || written >= needed)
            return path;
        whole.resize(written);
        return whole;
    }

    int RunDialog(const PickerArguments& arguments) override {
        HostInputRestorer restorer;
        CDialogRun dialog(m_app, CallArguments(arguments));
        return static_cast<int>(dialog.DoModal());
    }

    CTessel3Doc* Document() override { return g_pTessel3Doc; }

    const DrawingFolder* Folder() override { return m_app.Folder(); }

    void DestroyDocument() override {
        m_app.EndRun();       // the folder model writes to the document: it goes first
        delete g_pTessel3Doc; // saves the explorer's settings and clears the pointer
    }

    void FocusHostView() override {
        if (HWND view = acedGetAcadDwgView())
            ::SetFocus(view);
    }

private:
    CMdiMixin& m_app;
};

} // namespace

std::unique_ptr<PickerPlatform> MakeWindowsPickerPlatform(CMdiMixin& app) {
    return std::make_unique<WindowsPickerPlatform>(app);
}
