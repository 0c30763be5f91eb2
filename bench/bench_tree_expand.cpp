// Expanding a folder of many sub-folders in the folder tree, phase by phase:
//   enumerate   the shell's enumeration of the sub-folders alone
//   sort        the same ids sorted with the folder's own comparison
//   insert      as many plain items inserted into a bare tree control
//   expand      the explorer's tree expanding the node: enumeration, insertion, sort, behind the animation;
//               with the explorer's settings (system icons asked for when first shown) and, for the smaller
//               folders, with every attribute computed at insertion
// and, for the expansion, the longest stall of the user-interface thread seen by a watcher thread that
// pings the tree every few milliseconds, and how often the animation thread woke meanwhile (timer ticks
// and progress reports).
//
// bench_tree_expand DIR [COUNT...]: makes DIR\COUNT\d00001... (kept between runs) and measures each COUNT.
#include "resource.h"
#include "tests/support/MessagePump.h"
#include "tree/LeftView.h"
#include "tree/ShellNamespace.h"
#include "tree/ShellTreeCtrl.h"

#include <windows.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

namespace {

CWinApp theApp("TreeExpandBench");

using Clock = std::chrono::steady_clock;
double MsSince(Clock::time_point start) {
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

bool MakeFolders(const std::string& dir, int count) {
    const std::string marker = dir + "\\.complete";
    if (::GetFileAttributesA(marker.c_str()) != INVALID_FILE_ATTRIBUTES)
        return true;
    ::CreateDirectoryA(dir.c_str(), nullptr);
    char name[32];
    for (int i = 1; i <= count; ++i) {
        std::snprintf(name, sizeof name, "\\d%05d", i);
        const std::string path = dir + name;
        if (!::CreateDirectoryA(path.c_str(), nullptr) && ::GetLastError() != ERROR_ALREADY_EXISTS)
            return false;
    }
    HANDLE file = ::CreateFileA(marker.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS,
                                FILE_ATTRIBUTE_HIDDEN, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return false;
    ::CloseHandle(file);
    return true;
}

CShellPidl PidlOf(const std::string& path) {
    CDesktopFolderRef desktop;
    return ShellPidlOfPath(desktop.get(), path);
}

class Window : public CWnd {
public:
    bool CreateShown() {
        return CreateEx(0, nullptr, "tree expand", WS_POPUP | WS_VISIBLE, CRect(0, 0, 400, 700), nullptr, 0);
    }
};

// The explorer's tree, counting the animation's frames.
class CountingTree : public CHourglassFX<CProgressFX<CShellTreeCtrl>> {
public:
    std::atomic<int> frames{0};

protected:
    void DoAnimation(bool tick, int total, int count) override {
        CHourglassFX<CProgressFX<CShellTreeCtrl>>::DoAnimation(tick, total, count);
        ++frames;
    }
};

struct Row {
    int count = 0;
    UINT mask = 0;
    double enumerate = 0, sort = 0, insert = 0, expand = 0, stall = 0;
    int children = 0, frames = 0;
};

Row Measure(const std::string& dir, int count, UINT mask) {
    Row row;
    row.count = count;
    row.mask = mask;
    CShellPidl folderId = PidlOf(dir);
    CDesktopFolderRef desktop;
    if (!folderId || !desktop)
        return row;

    IShellFolder* folder = BindShellFolder(desktop.get(), folderId.get());
    if (!folder)
        return row;
    auto start = Clock::now();
    IEnumIDList* enumerator = nullptr;
    std::vector<CShellPidl> ids;
    if (SUCCEEDED(folder->EnumObjects(nullptr, SHCONTF_FOLDERS, &enumerator)) && enumerator) {
        LPITEMIDLIST child = nullptr;
        while (enumerator->Next(1, &child, nullptr) == S_OK)
            ids.emplace_back(child);
        enumerator->Release();
    }
    row.enumerate = MsSince(start);
    start = Clock::now();
    std::sort(ids.begin(), ids.end(), [folder](const CShellPidl& a, const CShellPidl& b) {
        return CompareShellIds(folder, a.get(), b.get()) < 0;
    });
    row.sort = MsSince(start);
    folder->Release();

    Window window;
    window.CreateShown();
    {
        CTreeCtrl bare;
        bare.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES, CRect(0, 0, 400, 700), &window, 1);
        HTREEITEM parent = bare.InsertItem("parent", 0, 0, TVI_ROOT);
        start = Clock::now();
        for (int i = 0; i < count; ++i)
            bare.InsertItem("d" + std::to_string(i), 0, 0, parent);
        row.insert = MsSince(start);
        bare.DestroyWindow();
    }

    CountingTree tree;
    tree.SetHourglass(::LoadCursorW(AfxGetResourceHandle(), MAKEINTRESOURCEW(IDC_HOURGLASS)));
    tree.SetCallbackMask(mask);
    tree.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT,
                CRect(0, 0, 400, 700), &window, 2);
    testsupport::PumpMessages();
    // The folder's parent as the only top node; the folder its child, expanded below.
    const std::string parentDir = dir.substr(0, dir.find_last_of('\\'));
    CShellPidl parentId = PidlOf(parentDir);
    tree.PopulateTree(parentId.get(), 0);
    HTREEITEM node = tree.GetRootItem();
    const std::string leaf = dir.substr(dir.find_last_of('\\') + 1);
    while (node && _stricmp(tree.GetItemText(node).c_str(), leaf.c_str()) != 0)
        node = tree.GetNextSiblingItem(node);
    testsupport::PumpMessages();
    if (!node)
        return row;

    std::atomic<bool> done{false};
    std::atomic<long long> longestUs{0};
    const HWND hwnd = tree.m_hWnd;
    std::thread watcher([&] {
        while (!done) {
            const auto ping = Clock::now();
            DWORD_PTR result = 0;
            ::SendMessageTimeoutA(hwnd, WM_NULL, 0, 0, SMTO_NORMAL, 60000, &result);
            const long long us =
                std::chrono::duration_cast<std::chrono::microseconds>(Clock::now() - ping).count();
            if (us > longestUs)
                longestUs = us;
            ::Sleep(5);
        }
    });
    ::Sleep(20);
    start = Clock::now();
    tree.Expand(node, TVE_EXPAND);
    row.expand = MsSince(start);
    testsupport::PumpMessages();
    done = true;
    // The watcher's last ping waits for this thread's messages.
    while (watcher.joinable()) {
        testsupport::PumpMessages();
        if (::MsgWaitForMultipleObjects(0, nullptr, FALSE, 10, QS_ALLINPUT) == WAIT_TIMEOUT && done) {
            testsupport::PumpMessages();
            watcher.join();
        }
    }
    row.stall = longestUs / 1000.0;
    row.frames = tree.frames;
    for (HTREEITEM child = tree.GetChildItem(node); child; child = tree.GetNextSiblingItem(child))
        ++row.children;
    tree.DestroyWindow();
    window.DestroyWindow();
    return row;
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 2) {
        std::fprintf(stderr, "usage: bench_tree_expand DIR [COUNT...]\n");
        return 2;
    }
    ::CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
    std::vector<int> counts;
    for (int i = 2; i < argc; ++i)
        counts.push_back(std::atoi(argv[i]));
    if (counts.empty())
        counts = {2000, 20000};
    const std::string base = argv[1];
    ::CreateDirectoryA(base.c_str(), nullptr);
    std::printf("| Sub-folders | Attributes | Enumerate ms | Sort ms | Insert (bare tree) ms | Expand ms "
                "| Longest UI stall ms | Animation wake-ups | Children "
                "|\n|---:|---|---:|---:|---:|---:|---:|---:|---:|\n");
    for (int count : counts) {
        const std::string dir = base + "\\folders-" + std::to_string(count);
        if (!MakeFolders(dir, count)) {
            std::fprintf(stderr, "could not make %s\n", dir.c_str());
            return 1;
        }
        // Every attribute at insertion costs the shell's icon lookups for each item: only the small folders.
        std::vector<UINT> masks{CShellTreeCtrl::kCallbackImage | CShellTreeCtrl::kCallbackSelectedImage};
        if (count <= 2000)
            masks.push_back(0);
        for (UINT mask : masks) {
            const Row row = Measure(dir, count, mask);
            std::printf("| %d | %s | %.0f | %.0f | %.0f | %.0f | %.0f | %d | %d |\n", row.count,
                        mask ? "icons when shown (explorer)" : "all at insertion", row.enumerate, row.sort,
                        row.insert, row.expand, row.stall, row.frames, row.children);
            std::fflush(stdout);
        }
    }
    ::CoUninitialize();
    return 0;
}
