#include "ShellNamespace.h"

#include "ShellString.h"

#include "hostapi/NarrowText.h"

#include <algorithm>

std::string ShellDisplayName(IShellFolder* parentFolder, LPCITEMIDLIST relativeId, SHGDNF how) {
    if (!parentFolder || !relativeId)
        return {};
    STRRET name{};
    if (FAILED(parentFolder->GetDisplayNameOf(relativeId, how, &name)))
        return {};
    return CShellString(name, relativeId).Text();
}

namespace {

// The path the system gives for an absolute id, or empty. It may be cut: the system's functions hold
// MAX_PATH characters (Wine cuts a longer path, Windows fails).
std::string SystemPathOf(LPCITEMIDLIST absoluteId) {
    char buffer[MAX_PATH] = "";
    if (!SHGetPathFromIDListA(absoluteId, buffer))
        return {};
    return buffer;
}

// A path longer than the system's functions hold, put together from the parent's path and the item's
// name in its folder as the file system knows it. Empty when the parent has no path (a virtual folder).
std::string LongPathOf(LPCITEMIDLIST absoluteId, std::size_t capacity) {
    LPCITEMIDLIST last = LastItemId(absoluteId);
    const auto offset = static_cast<std::size_t>(reinterpret_cast<const BYTE*>(last) -
                                                 reinterpret_cast<const BYTE*>(absoluteId));
    if (!last || offset == 0)
        return {};
    CShellPidl parentId = CShellPidl::CopyOf(absoluteId);
    if (!parentId)
        return {};
    reinterpret_cast<SHITEMID*>(reinterpret_cast<BYTE*>(parentId.get()) + offset)->cb = 0; // cut the last id
    std::string parentPath;
    if (!ShellFileSystemPath(parentId.get(), parentPath, capacity))
        return {};
    CDesktopFolderRef desktop;
    IShellFolder* parent = BindShellFolder(desktop.get(), parentId.get());
    if (!parent)
        return {};
    const std::string name = ShellDisplayName(parent, last, SHGDN_INFOLDER | SHGDN_FORPARSING);
    parent->Release();
    if (name.empty() || FindCharacter(name, '\\') != std::string::npos)
        return {};
    return WithSeparator(parentPath) + name;
}

} // namespace

bool ShellFileSystemPath(LPCITEMIDLIST absoluteId, std::string& path, std::size_t capacity) {
    path.clear();
    if (!absoluteId)
        return false;
    std::string found = SystemPathOf(absoluteId);
    // A path as long as the system's buffer holds may have been cut (it would name another folder), and
    // one longer is not given at all (asked for by a caller that takes long paths): it is put together
    // from its parent's.
    if (found.empty() ? capacity > MAX_PATH : CharacterCount(found) >= MAX_PATH - 1) {
        std::string whole = LongPathOf(absoluteId, kLongestPathChars + 1);
        if (!whole.empty())
            found = whole;
    }
    if (found.empty() || found.size() + 1 > capacity)
        return false;
    path = found;
    return true;
}

std::string ShellLabelOf(IShellFolder* parentFolder, LPCITEMIDLIST absoluteId, std::uint32_t flags) {
    std::string label;
    if ((flags & kShellFileSystemName) && ShellFileSystemPath(absoluteId, label) &&
        !(flags & kShellNormalName)) {
        // The rightmost n characters, n being the position of the last backslash: the tree has always
        // cut its labels this way, which is not the same as taking the file name. Counted in characters.
        const std::vector<std::size_t> starts = CharacterStarts(label);
        const std::size_t slash = LastCharacterOf(label, "\\");
        const std::size_t n =
            slash == std::string::npos
                ? 0
                : static_cast<std::size_t>(std::lower_bound(starts.begin(), starts.end(), slash) -
                                           starts.begin());
        label = n == 0 ? std::string() : label.substr(starts[starts.size() - n]);
    }
    if (label.empty())
        label = ShellDisplayName(parentFolder, LastItemId(absoluteId),
                                 (flags & kShellNormalName) ? SHGDN_NORMAL : SHGDN_INFOLDER);
    return label;
}

bool ShellHasChildren(IShellFolder* parentFolder, LPCITEMIDLIST relativeId, std::uint32_t flags) {
    if (!parentFolder || !relativeId)
        return false;
    SFGAOF attributes = SFGAO_FOLDER;
    if (FAILED(parentFolder->GetAttributesOf(1, &relativeId, &attributes)) || !(attributes & SFGAO_FOLDER))
        return false;
    if ((flags & kShellNonFolders) || (attributes & SFGAO_REMOVABLE))
        return true;
    attributes = SFGAO_HASSUBFOLDER;
    if (FAILED(parentFolder->GetAttributesOf(1, &relativeId, &attributes)))
        return false;
    return (attributes & SFGAO_HASSUBFOLDER) != 0;
}

IShellFolder* BindShellFolder(IShellFolder* desktop, LPCITEMIDLIST absoluteId) {
    if (!desktop || !absoluteId)
        return nullptr;
    if (ItemIdListSize(absoluteId) == 0) {
        desktop->AddRef();
        return desktop;
    }
    IShellFolder* folder = nullptr;
    if (FAILED(
            desktop->BindToObject(absoluteId, nullptr, IID_IShellFolder, reinterpret_cast<void**>(&folder))))
        return nullptr;
    return folder;
}

CShellPidl ShellPidlOfPath(IShellFolder* desktop, const std::string& path) {
    CShellPidl parsed;
    if (!desktop || path.empty())
        return parsed;
    const int n = ::MultiByteToWideChar(CP_THREAD_ACP, 0, path.c_str(), -1, nullptr, 0);
    if (n <= 0)
        return parsed;
    std::wstring wide(static_cast<std::size_t>(n), L'\0');
    ::MultiByteToWideChar(CP_THREAD_ACP, 0, path.c_str(), -1, wide.data(), n);
    ULONG eaten = 0;
    desktop->ParseDisplayName(nullptr, nullptr, wide.data(), &eaten, parsed.Receive(), nullptr);
    return parsed;
}

int CompareShellIds(IShellFolder* folder, LPCITEMIDLIST a, LPCITEMIDLIST b) {
    const HRESULT result = folder->CompareIDs(0, a, b);
    if (FAILED(result))
        return 0;
    const short code = static_cast<short>(HRESULT_CODE(result));
    return code < 0 ? -1 : code > 0 ? 1 : 0;
}

std::vector<CShellPidl> EnumerateShellChildren(IShellFolder* folder, HWND owner, std::uint32_t flags) {
    std::vector<CShellPidl> children;
    if (!folder)
        return children;
    const SHCONTF what = SHCONTF_FOLDERS | ((flags & kShellNonFolders) ? SHCONTF_NONFOLDERS : 0) |
                         ((flags & kShellHidden) ? SHCONTF_INCLUDEHIDDEN : 0);
    IEnumIDList* enumerator = nullptr;
    // S_FALSE with no enumerator is a folder that has nothing to show.
    if (FAILED(folder->EnumObjects(owner, what, &enumerator)) || !enumerator)
        return children;
    LPITEMIDLIST child = nullptr;
    while (enumerator->Next(1, &child, nullptr) == S_OK) {
        children.emplace_back(child);
        child = nullptr;
    }
    enumerator->Release();
    std::stable_sort(children.begin(), children.end(), [folder](const CShellPidl& a, const CShellPidl& b) {
        return CompareShellIds(folder, a.get(), b.get()) < 0;
    });
    return children;
}

ShellPathWalk WalkShellLabelPath(const std::string& labelPath) {
    ShellPathWalk walk;
    CDesktopFolderRef desktop;
    if (!desktop)
        return walk;
    CShellPidl desktopId;
    if (FAILED(SHGetSpecialFolderLocation(nullptr, CSIDL_DESKTOP, desktopId.Receive())) || !desktopId)
        return walk;

    for (const std::string& component : SplitLabelPath(labelPath)) {
        if (component.empty())
            break; // a path ends at its first empty name
        // The candidates: the Desktop at the top, else the children of the node reached last.
        IShellFolder* parent = nullptr;
        CShellPidl parentId;
        std::vector<CShellPidl> relativeIds;
        if (walk.steps.empty()) {
            parent = desktop.get();
            parent->AddRef();
            relativeIds.push_back(CShellPidl::CopyOf(desktopId.get()));
        } else {
            parentId = CShellPidl::CopyOf(walk.steps.back().absoluteId.get());
            parent = BindShellFolder(desktop.get(), parentId.get());
            relativeIds = EnumerateShellChildren(parent, nullptr, 0);
        }
        bool found = false;
        for (const CShellPidl& relative : relativeIds) {
            CShellPidl absolute = walk.steps.empty() ? CShellPidl::CopyOf(relative.get())
                                                     : CShellPidl::Concat(parentId.get(), relative.get());
            std::string label = ShellLabelOf(parent, absolute.get(), 0);
            if (lstrcmpiA(label.c_str(), component.c_str()) == 0) {
                walk.steps.push_back({std::move(absolute), std::move(label)});
                found = true;
                break;
            }
        }
        if (parent)
            parent->Release();
        if (!found)
            return walk;
    }
    walk.complete = true;
    return walk;
}
