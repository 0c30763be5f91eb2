// The start folder's label path, built from the shell's display names.
#include "tree/StartShellPath.h"

#include "hostapi/NarrowText.h"

#include <windows.h>
#include <shellapi.h>
#include <shlobj.h>
#include <shlwapi.h>

#include <cstdlib>

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

} // namespace

std::string StartShellPathOf(const std::string& path) {
    IShellFolder* desktop = nullptr;
    if (FAILED(SHGetDesktopFolder(&desktop)) || !desktop)
        return {};
    const std::string desktopName = SpecialFolderName(desktop, CSIDL_DESKTOP);
    const std::string computerName = SpecialFolderName(desktop, CSIDL_DRIVES);
    const std::string networkName = SpecialFolderName(desktop, CSIDL_NETWORK);
    desktop->Release();

    // The drive ("C:") and the folders after it up to the last separator, found by character: the
    // second byte of a double-byte character may look like a separator.
    std::string drive, dir;
    if (path.size() >= 2 && path[1] == ':')
        drive = path.substr(0, 2);
    if (const std::size_t last = LastSeparator(path); last != std::string::npos && last >= drive.size())
        dir = path.substr(drive.size(), last + 1 - drive.size());
    // As the runtime's path splitting does: folders its buffer cannot hold give neither drive nor folders.
    if (dir.size() >= _MAX_DIR) {
        drive.clear();
        dir.clear();
    }
    std::string driveName;
    if (!drive.empty()) {
        std::string root = drive + "\\";
        SHFILEINFOA info{};
        if (SHGetFileInfoA(root.c_str(), 0, &info, sizeof info, SHGFI_DISPLAYNAME))
            driveName = info.szDisplayName;
        else
            driveName = root;
    }
    std::string result = desktopName + "\\";
    if (!drive.empty())
        result += computerName + "\\" + driveName;
    else
        result += networkName;
    return result + dir;
}
