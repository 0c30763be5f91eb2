// The file commands as the grid offers them: its own context menu (what is greyed when, what each entry
// runs), the thumbnail menu's entries, the frame's copy, cut and paste commands, and the refresh after a
// change. The file operations themselves are the owner's (the handlers); fileops_win_tests test them.
#include "GridTestSupport.h"

#include "res/resource.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

// What the grid asked of its file commands, and how often it read its folder again afterwards.
struct FileCalls : GridFileCommands {
    std::vector<std::string> calls;
    bool holdsDrawings = false;
    bool pasteSucceeds = true;
    int refreshes = 0;

    bool ClipboardHoldsDrawings() override { return holdsDrawings; }
    void Copy(const std::vector<std::string>&, bool cut) override { calls.push_back(cut ? "cut" : "copy"); }
    int Paste(const std::string&) override {
        calls.push_back("paste");
        return pasteSucceeds ? 0 : kFileCommandNotDone;
    }
    int Delete(const std::vector<std::string>&) override {
        calls.push_back("delete");
        return 0;
    }
    int Rename(const std::string&, const std::string&) override {
        calls.push_back("rename");
        return 0;
    }
    void ShowProperties(const std::string& path) override { calls.push_back("properties " + path); }
};

// Once the bench shows its drawings: the grid's commands go to record, which counts the folder's reads.
void Wire(CTessel3View& view, FileCalls& record) {
    view.SetFileCommands(&record);
    Drawings().onShown = [&record, shown = Drawings().onShown] {
        ++record.refreshes;
        if (shown)
            shown();
    };
}

// The states of the grid's menu while it is open, read through the menu window; then the entry with this
// number is chosen (0: dismissed).
struct MenuProbe {
    static std::vector<std::string> s_items; // "text:state" in menu order
    static UINT s_choose;
    static void CALLBACK Tick(HWND, UINT, UINT_PTR timer, DWORD) {
        HWND menuWindow = ::FindWindowA("#32768", nullptr);
        if (!menuWindow || !::IsWindowVisible(menuWindow))
            return;
        ::KillTimer(nullptr, timer);
        auto menu = reinterpret_cast<HMENU>(::SendMessageA(menuWindow, MN_GETHMENU, 0, 0));
        s_items.clear();
        for (int i = 0; menu && i < ::GetMenuItemCount(menu); ++i) {
            char text[64] = "";
            ::GetMenuStringA(menu, static_cast<UINT>(i), text, sizeof text, MF_BYPOSITION);
            const UINT state = ::GetMenuState(menu, static_cast<UINT>(i), MF_BYPOSITION);
            s_items.push_back(std::string(text) + ":" + std::to_string(::GetMenuItemID(menu, i)) +
                              ((state & MF_GRAYED) ? ":grey" : ":on"));
        }
        if (s_choose) {
            // The entry's key, as a person would press it.
            ::PostMessageA(menuWindow, WM_KEYDOWN, s_choose, 0);
            ::PostMessageA(menuWindow, WM_CHAR, s_choose + ('a' - 'A'), 0);
        } else {
            ::EndMenu();
        }
    }
};
std::vector<std::string> MenuProbe::s_items;
UINT MenuProbe::s_choose = 0;

int OpenGridMenu(CTessel3View& view, UINT chooseKey) {
    MenuProbe::s_choose = chooseKey;
    MenuProbe::s_items.clear();
    const UINT_PTR timer = ::SetTimer(nullptr, 0, 100, &MenuProbe::Tick);
    POINT at{300, 300};
    ::ClientToScreen(view.m_hWnd, &at);
    const int chosen = view.RunContextMenu(at);
    ::KillTimer(nullptr, timer);
    Pump();
    return chosen;
}

} // namespace

TEST(GridFileMenu, NothingSelectedAndNoDrawingsOnTheClipboardGreysAll) {
    GridBench bench;
    FileCalls record;
    FillList(3);
    bench.view().Rebuild();
    Pump();
    Wire(bench.view(), record);
    EXPECT_EQ(OpenGridMenu(bench.view(), 0), 0);
    EXPECT_EQ(MenuProbe::s_items, (std::vector<std::string>{"&Copy:1:grey", "&Delete:3:grey", "&Paste:2:grey",
                                                            "&Rename:4:grey"}));
    EXPECT_TRUE(record.calls.empty());
}

TEST(GridFileMenu, ASelectionAndDrawingsOnTheClipboardEnableAllButRename) {
    GridBench bench;
    FileCalls record;
    FillList(3);
    DwgList[1].Select();
    record.holdsDrawings = true;
    bench.view().Rebuild();
    Pump();
    Wire(bench.view(), record);
    EXPECT_EQ(OpenGridMenu(bench.view(), 0), 0);
    EXPECT_EQ(MenuProbe::s_items,
              (std::vector<std::string>{"&Copy:1:on", "&Delete:3:on", "&Paste:2:on", "&Rename:4:grey"}));
}

TEST(GridFileMenu, EachEntryRunsItsCommandAndChangesRefresh) {
    GridBench bench;
    FileCalls record;
    FillList(3);
    DwgList[0].Select();
    record.holdsDrawings = true;
    bench.view().Rebuild();
    Pump();
    Wire(bench.view(), record);
    EXPECT_EQ(OpenGridMenu(bench.view(), 'C'), 1);
    EXPECT_EQ(record.refreshes, 0) << "a copy changes no folder";
    DwgList[0].Select(); // the rescans of the bench keep no selection
    EXPECT_EQ(OpenGridMenu(bench.view(), 'P'), 2);
    EXPECT_EQ(record.refreshes, 1);
    DwgList[0].Select();
    EXPECT_EQ(OpenGridMenu(bench.view(), 'D'), 3);
    EXPECT_EQ(record.refreshes, 2);
    EXPECT_EQ(record.calls, (std::vector<std::string>{"copy", "paste", "delete"}));
    // A paste that did nothing leaves the folder as it was.
    record.pasteSucceeds = false;
    EXPECT_EQ(OpenGridMenu(bench.view(), 'P'), 2);
    EXPECT_EQ(record.refreshes, 2);
}

TEST(GridFileMenu, TheFramesCopyCutAndPasteReachTheFileCommands) {
    GridBench bench;
    FileCalls record;
    FillList(2);
    bench.view().Rebuild();
    Pump();
    Wire(bench.view(), record);
    bench.view().SendMessage(WM_COMMAND, ID_EDIT_COPY);
    bench.view().SendMessage(WM_COMMAND, ID_EDIT_CUT);
    bench.view().SendMessage(WM_COMMAND, ID_EDIT_PASTE);
    Pump();
    EXPECT_EQ(record.calls, (std::vector<std::string>{"copy", "cut", "paste"}));
    EXPECT_EQ(record.refreshes, 1);
}

TEST(GridFileMenu, AFailedCommandSaysWhyAndShowsTheFolderAsItIs) {
    GridBench bench;
    FillList(3, "C:\\");
    bench.view().Rebuild();
    Pump();
    struct Refusing : FileCalls {
        int Delete(const std::vector<std::string>&) override { return ERROR_ACCESS_DENIED; }
        int Paste(const std::string&) override { return 1234; }
    } record;
    Wire(bench.view(), record);
    DwgList[1].Select();
    Frame().toldUser.clear();
    bench.view().DeleteSelection();
    Pump();
    EXPECT_EQ(record.refreshes, 1) << "the folder is read again";
    ASSERT_EQ(Frame().toldUser.size(), 1u);
    // C:\ holds no d00001.dwg: that is the reason found first.
    EXPECT_EQ(Frame().toldUser[0],
              "Cannot delete \"d00001.dwg\": d00001.dwg no longer exists. The folder is shown as it is now.");
    bench.view().PasteFiles();
    Pump();
    EXPECT_EQ(record.refreshes, 2);
    ASSERT_EQ(Frame().toldUser.size(), 2u);
    EXPECT_EQ(Frame().toldUser[1],
              "Cannot paste into \"C:\\\": the system refused it (error 1234). The folder "
              "is shown as it is now.");
}

TEST(GridFileMenu, ACommandTheUserSaidNoToIsNotAFailure) {
    GridBench bench;
    FillList(3);
    bench.view().Rebuild();
    Pump();
    struct SaysNo : FileCalls {
        int Delete(const std::vector<std::string>&) override { return kFileCommandNotDone; }
    } record;
    Wire(bench.view(), record);
    DwgList[0].Select();
    Frame().toldUser.clear();
    bench.view().DeleteSelection();
    Pump();
    EXPECT_EQ(record.refreshes, 0);
    EXPECT_TRUE(Frame().toldUser.empty());
}

TEST(GridFileMenu, ThumbnailMenuGreysPasteUnlessTheClipboardHoldsDrawings) {
    CMenu menu;
    CMenu popup = BuildThumbnailMenu(menu, 0, false);
    ASSERT_NE(popup.m_hMenu, nullptr);
    EXPECT_TRUE(popup.GetMenuState(ID_THUMB_PASTE, MF_BYCOMMAND) & MF_GRAYED);
    CMenu menu2;
    CMenu popup2 = BuildThumbnailMenu(menu2, 0, true);
    EXPECT_FALSE(popup2.GetMenuState(ID_THUMB_PASTE, MF_BYCOMMAND) & MF_GRAYED);
}
