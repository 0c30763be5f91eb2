// The picker's platform on Windows: the shell's display names, the run dialog and the document.
#include "host/ArxApp.h"
#include "host/DialogRun.h"
#include "host/Orvex.h"
#include "hostapi/HostApi.h"
#include "settings/Tessel3Doc.h"

#include <shellapi.h>
#include <shlobj.h>
#include <shlwapi.h>

#include <cstdlib>
#include <cstring>

namespace {

// An item id list from the shell allocator, freed with it.
class ShellItemList {
public:
    ShellItemList() = default;
    ~ShellItemList() { CoTaskMemFree(m_pidl); }
    ShellItemList(const ShellItemList&) = delete;
    ShellItemList& operator=(const ShellItemList&) = delete;
    LPITEMIDLIST* operator&() { return &m_pidl; }
    LPCITEMIDLIST get() const { return m_pidl; }

private:
    LPITEMIDLIST m_pidl = nullptr;
};

// The display name of a special shell place (CSIDL), narrow, at most 259 characters.
std::string SpecialFolderName(IShellFolder* desktop, int csidl) {
    ShellItemList pidl;
    if (FAILED(SHGetSpecialFolderLocation(nullptr, csidl, &pidl)) || !pidl.get())
        return {};
    STRRET name{};
    if (FAILED(desktop->GetDisplayNameOf(pidl.get(), SHGDN_NORMAL, &name)))
        return {};
    char text[MAX_PATH] = "";
    if (FAILED(StrRetToBufA(&name, pidl.get(), text, MAX_PATH)))
        return {};
    return text;
}

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

class WindowsPickerPlatform : public PickerPlatform {
public:
    std::string StartShellPath(const std::string& path) override {
        IShellFolder* desktop = nullptr;
        if (FAILED(SHGetDesktopFolder(&desktop)) || !desktop)
            return {};
        const std::string desktopName = SpecialFolderName(desktop, CSIDL_DESKTOP);
        const std::string computerName = SpecialFolderName(desktop, CSIDL_DRIVES);
        const std::string networkName = SpecialFolderName(desktop, CSIDL_NETWORK);
        desktop->Release();

        char drive[_MAX_DRIVE] = "", dir[_MAX_DIR] = "", fname[_MAX_FNAME] = "", ext[_MAX_EXT] = "";
        _splitpath(path.c_str(), drive, dir, fname, ext);
        std::string driveName;
        if (drive[0]) {
            std::string root = std::string(drive) + "\\";
            SHFILEINFOA info{};
            if (SHGetFileInfoA(root.c_str(), 0, &info, sizeof info, SHGFI_DISPLAYNAME))
                driveName = info.szDisplayName;
            else
                driveName = root;
        }
        std::string result = desktopName + "\\";
        if (drive[0])
            result += computerName + "\\" + driveName;
        else
            result += networkName;
        return result + dir;
    }

    int RunDialog() override {
        HostInputRestorer restorer;
        CDialogRun dialog;
        return static_cast<int>(dialog.DoModal());
    }

    CTessel3Doc* Document() override { return g_pTessel3Doc; }

    void DestroyDocument() override {
        delete g_pTessel3Doc; // saves the explorer's settings and clears the pointer
    }

    void FocusHostView() override {
        if (HWND view = acedGetAcadDwgView())
            ::SetFocus(view);
    }
};

} // namespace

PickerPlatform& DefaultPickerPlatform() {
    static WindowsPickerPlatform platform;
    return platform;
}
