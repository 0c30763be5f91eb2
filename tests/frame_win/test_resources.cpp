// The explorer's resources as the frame and the thumbnails load them.
#include "framework/afxwin.h"

#include "res/resource.h"

#include <gtest/gtest.h>

#include <cstring>

#include <set>
#include <string>
#include <tuple>
#include <vector>

namespace {

std::string MenuText(HMENU menu, UINT item, UINT flags) {
    char text[128] = "";
    ::GetMenuStringA(menu, item, text, sizeof text, flags);
    return text;
}

// The words of a toolbar resource: version, width, height, count, ids.
std::vector<WORD> ToolbarWords(UINT id) {
    HMODULE module = AfxGetResourceHandle();
    HRSRC found = ::FindResourceA(module, MAKEINTRESOURCEA(id), MAKEINTRESOURCEA(241));
    if (!found)
        return {};
    const auto* words = static_cast<const WORD*>(::LockResource(::LoadResource(module, found)));
    const DWORD size = ::SizeofResource(module, found);
    return std::vector<WORD>(words, words + size / sizeof(WORD));
}

} // namespace

TEST(Resources, AcceleratorsAsListed) {
    HACCEL table = ::LoadAcceleratorsA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDR_MAINFRAME));
    ASSERT_NE(table, nullptr);
    ACCEL entries[32];
    const int count = ::CopyAcceleratorTableA(table, entries, 32);
    std::set<std::tuple<int, int, int>> got;
    for (int i = 0; i < count; ++i)
        got.insert({entries[i].fVirt & ~FNOINVERT, entries[i].key, entries[i].cmd});
    const int ctrl = FVIRTKEY | FCONTROL, shift = FVIRTKEY | FSHIFT, none = FVIRTKEY;
    // Only keys that do something here: no new, save, print or undo in a picker (an edit box undoes its
    // own typing with Ctrl+Z and Alt+Backspace).
    const std::set<std::tuple<int, int, int>> expected = {
        {ctrl, 'A', 32793},        {ctrl, 'C', 57634},       {ctrl, 'O', 57601},
        {ctrl, 'V', 57637},        {none, VK_DELETE, 32794}, {shift, VK_DELETE, 57635},
        {none, VK_F6, 57680},      {shift, VK_F6, 57681},    {ctrl, VK_INSERT, 57634},
        {shift, VK_INSERT, 57637}, {ctrl, 'X', 57635},       {none, VK_F5, ID_VIEW_REFRESH}};
    EXPECT_EQ(count, 12);
    EXPECT_EQ(got, expected);
    ::DestroyAcceleratorTable(table);
}

TEST(Resources, PromptsOfTheExplorerCommands) {
    EXPECT_EQ(CWinApp::LoadString(IDR_MAINFRAME), "Orvex1");
    EXPECT_EQ(CWinApp::LoadString(32771), "Scroll to begin\nScroll to begin");
    EXPECT_EQ(CWinApp::LoadString(32774), "Increase\nIncrease");
    EXPECT_EQ(CWinApp::LoadString(32775), "Decrease\nDecrease");
    EXPECT_EQ(CWinApp::LoadString(32782), "Aligne\nAligne");
    EXPECT_EQ(CWinApp::LoadString(32788), "Sort by date\nSort by date");
    EXPECT_EQ(CWinApp::LoadString(32789), "Sort by size\nSort by size");
    EXPECT_EQ(CWinApp::LoadString(32799), "Sort by name\nSort by name");
    EXPECT_EQ(CWinApp::LoadString(32792), "Redraw/nRedraw");
    EXPECT_NE(CWinApp::LoadString(ID_ACCEPT).find('\n'), std::string::npos);
    EXPECT_NE(CWinApp::LoadString(ID_CANCEL_PICK).find('\n'), std::string::npos);
}

TEST(Resources, MainToolbarWithItsPlaceholders) {
    const std::vector<WORD> words = ToolbarWords(IDR_MAINFRAME);
    ASSERT_GE(words.size(), 4u);
    EXPECT_EQ(words[0], 1);
    EXPECT_EQ(words[1], 16);
    EXPECT_EQ(words[2], 15);
    const std::vector<WORD> ids(words.begin() + 4, words.end());
    EXPECT_EQ(ids.size(), words[3]);
    const std::vector<WORD> expected = {32771, 32774, 32775, 32782, 0,     32799,
                                        32788, 32789, 0,     32804, 32790, 32805};
    EXPECT_EQ(ids, expected);
}

TEST(Resources, BottomToolbarAcceptAndCancel) {
    const std::vector<WORD> words = ToolbarWords(IDR_TOOLBAR2);
    ASSERT_GE(words.size(), 4u);
    EXPECT_EQ(words[0], 1);
    const std::vector<WORD> ids(words.begin() + 4, words.end());
    EXPECT_EQ(ids.size(), words[3]);
    EXPECT_EQ(ids, (std::vector<WORD>{32795, 0, 32796}));
}

TEST(Resources, ToolbarBitmapsHoldOneImagePerButton) {
    for (auto [id, buttons] :
         {std::pair<UINT, int>{IDR_MAINFRAME, 10}, std::pair<UINT, int>{IDR_TOOLBAR2, 2}}) {
        const std::vector<WORD> words = ToolbarWords(id);
        ASSERT_GE(words.size(), 4u);
        HBITMAP bitmap = ::LoadBitmapA(AfxGetResourceHandle(), MAKEINTRESOURCEA(id));
        ASSERT_NE(bitmap, nullptr) << id;
        BITMAP info{};
        ::GetObjectA(bitmap, sizeof info, &info);
        EXPECT_EQ(info.bmWidth, words[1] * buttons) << id;
        EXPECT_EQ(info.bmHeight, words[2]) << id;
        ::DeleteObject(bitmap);
    }
}

TEST(Resources, IconAndDragCursor) {
    EXPECT_NE(::LoadIconA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDR_MAINFRAME)), nullptr);
    EXPECT_NE(::LoadCursorA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDC_DRAG_CURSOR)), nullptr);
}

TEST(Resources, HourglassIsAnAnimatedCursorOfTenFrames) {
    HRSRC found = ::FindResourceA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDC_HOURGLASS), RT_ANICURSOR);
    ASSERT_NE(found, nullptr);
    const auto* data =
        static_cast<const unsigned char*>(::LockResource(::LoadResource(AfxGetResourceHandle(), found)));
    ASSERT_NE(data, nullptr);
    ASSERT_EQ(std::memcmp(data, "RIFF", 4), 0);
    ASSERT_EQ(std::memcmp(data + 8, "ACONanih", 8), 0);
    DWORD frames = 0;
    std::memcpy(&frames, data + 20 + 4, sizeof frames); // the header's size, then the frame count
    EXPECT_GE(frames, 10u);

    HCURSOR hourglass = ::LoadCursorW(AfxGetResourceHandle(), MAKEINTRESOURCEW(IDC_HOURGLASS));
    ASSERT_NE(hourglass, nullptr);
    HDC screen = ::GetDC(nullptr);
    HDC memory = ::CreateCompatibleDC(screen);
    HBITMAP bitmap = ::CreateCompatibleBitmap(screen, 16, 16);
    HGDIOBJ old = ::SelectObject(memory, bitmap);
    for (UINT step = 0; step < 10; ++step)
        EXPECT_TRUE(::DrawIconEx(memory, 0, 0, hourglass, 16, 16, step, nullptr, DI_NORMAL)) << step;
    ::SelectObject(memory, old);
    ::DeleteObject(bitmap);
    ::DeleteDC(memory);
    ::ReleaseDC(nullptr, screen);
}

TEST(Resources, ThumbnailContextMenu) {
    CMenu menu;
    ASSERT_TRUE(menu.LoadMenu(IDR_THUMB_MENU));
    ASSERT_EQ(menu.GetMenuItemCount(), 1);
    HMENU popup = ::GetSubMenu(menu, 0);
    ASSERT_NE(popup, nullptr);
    ASSERT_EQ(::GetMenuItemCount(popup), 6);
    EXPECT_EQ(::GetMenuItemID(popup, 0), 32797u);
    EXPECT_EQ(MenuText(popup, 0, MF_BYPOSITION), "&Copy");
    EXPECT_EQ(::GetMenuItemID(popup, 1), 32800u);
    EXPECT_EQ(MenuText(popup, 1, MF_BYPOSITION), "&Delete");
    EXPECT_EQ(::GetMenuItemID(popup, 2), 32801u);
    EXPECT_EQ(MenuText(popup, 2, MF_BYPOSITION), "&Paste");
    EXPECT_EQ(::GetMenuItemID(popup, 3), 32802u);
    EXPECT_EQ(MenuText(popup, 3, MF_BYPOSITION), "&Rename");
    EXPECT_EQ(MenuText(popup, 4, MF_BYPOSITION), "&Sort");
    HMENU sort = ::GetSubMenu(popup, 4);
    ASSERT_NE(sort, nullptr);
    EXPECT_EQ(MenuText(sort, 32799, MF_BYCOMMAND), "&By Name");
    EXPECT_EQ(MenuText(sort, 32788, MF_BYCOMMAND), "By &Date");
    EXPECT_EQ(MenuText(sort, 32789, MF_BYCOMMAND), "By &Size");
    EXPECT_EQ(::GetMenuItemID(popup, 5), 32803u);
    EXPECT_EQ(MenuText(popup, 5, MF_BYPOSITION), "Property");
}

TEST(Resources, RunDialogAndAboutBox) {
    EXPECT_NE(::FindResourceA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDD_DIALOG_RUN), MAKEINTRESOURCEA(5)),
              nullptr);
    EXPECT_NE(::FindResourceA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDD_ABOUTBOX), MAKEINTRESOURCEA(5)),
              nullptr);
}

TEST(Resources, VersionResource) {
    // Its fields are read from the shipped library by the release test; here: it is there at all.
    EXPECT_NE(::FindResourceA(AfxGetResourceHandle(), MAKEINTRESOURCEA(1), MAKEINTRESOURCEA(16)), nullptr);
}
