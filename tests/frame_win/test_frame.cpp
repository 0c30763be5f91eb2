// The explorer frame hosted by the library's run dialog, as the LISP function runs it: the dialog's
// initialisation creates and shows the explorer, the test script runs inside the modal loop, and the
// loop ends with what the explorer posts (1 accept, 2 cancel).
#include "frame/MainFrame.h"
#include "frame/MdiMixin.h"
#include "hostapi/HostApi.h"
#include "hostapi/NarrowText.h"
#include "host/DialogRun.h"
#include "settings/SettingsPath.h"
#include "settings/Tessel3Doc.h"
#include "tests/support/MessagePump.h"
#include "tests/support/TempFolder.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/Tessel3View.h"
#include "tree/LeftView.h"
#include "tree/StartShellPath.h"

#include "res/resource.h"

#include "OrvexVersion.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <fstream>
#include <functional>
#include <initializer_list>
#include <string>
#include <vector>

namespace {

class TestApp : public CMdiMixin {};
TestApp g_app;
// The arguments of the call the next run is given (the host's own frame is added from the host).
ExplorerCall g_call;

constexpr UINT WM_TEST_STEP = WM_APP + 7;
constexpr UINT_PTR kWatchdog = 77;
constexpr INT_PTR kTimedOut = -77;

// The arguments of this run, as the LISP function hands them to the run dialog: the host's frame, and
// the start folder's label path along which the tree opens.
ExplorerCall CallOfTheRun() {
    ExplorerCall call = g_call;
    call.hostFrame = acedGetAcadFrame();
    if (!call.startPath.empty() && call.startShellPath.empty())
        call.startShellPath = StartShellPathOf(call.startPath);
    return call;
}

// The library's run dialog, given a script of steps that run inside its modal loop and a watchdog.
class RunDialog : public CDialogRun {
public:
    RunDialog() : CDialogRun(g_app, CallOfTheRun()) {}

    std::function<void()> beforeCreate;
    std::vector<std::function<void(CMainFrame&)>> steps;
    bool created = false;
    bool hostDisabledDuringRun = false;
    HWND hostFrame = nullptr;

    bool OnInitDialog() override {
        if (beforeCreate)
            beforeCreate();
        const bool result = CDialogRun::OnInitDialog();
        created = g_app.ExplorerFrame() != nullptr;
        SetTimer(kWatchdog, 15000);
        PostMessage(WM_TEST_STEP, 0);
        return result;
    }

    bool PreTranslateMessage(MSG* pMsg) override {
        if (pMsg->message == WM_TEST_STEP && pMsg->hwnd == m_hWnd) {
            RunStep(static_cast<size_t>(pMsg->wParam));
            return true;
        }
        return CDialogRun::PreTranslateMessage(pMsg);
    }

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override {
        if (message == WM_TEST_STEP) { // in a loop that does not pre-translate, such as a message box's
            RunStep(static_cast<size_t>(wParam));
            return 0;
        }
        if (message == WM_TIMER && wParam == kWatchdog) {
            KillTimer(kWatchdog);
            ADD_FAILURE() << "the explorer did not end the run";
            EndDialog(kTimedOut);
            return 0;
        }
        return CDialogRun::WindowProc(message, wParam, lParam);
    }

private:
    void RunStep(size_t index) {
        if (hostFrame && !::IsWindowEnabled(hostFrame))
            hostDisabledDuringRun = true;
        if (index < steps.size() && g_app.ExplorerFrame()) {
            steps[index](*g_app.ExplorerFrame());
            PostMessage(WM_TEST_STEP, index + 1);
        }
    }
};

std::string MenuText(HMENU menu, UINT item, UINT flags) {
    char text[128] = "";
    ::GetMenuStringA(menu, item, text, sizeof text, flags);
    return text;
}

CRect ItemRect(CToolBar& bar, UINT id) {
    CRect rc;
    bar.GetItemRect(bar.CommandToIndex(id), &rc);
    return rc;
}

CRect RectInParent(CWnd& child) {
    CRect rc = child.GetWindowRect();
    ::MapWindowPoints(nullptr, ::GetParent(child.m_hWnd), reinterpret_cast<POINT*>(&rc), 2);
    return rc;
}

std::string TempFolder(const char* name) {
    static const testsupport::TempFolder scratch("orvex-frame"); // one for the program, removed at its end
    return scratch.MakeDir(name);
}

class ExplorerFrame : public ::testing::Test {
protected:
    void SetUp() override {
        g_app.SetUp(IDR_MAINFRAME);
        std::remove(ExplorerSettingsPath().c_str());
        g_call = ExplorerCall{};
        g_call.acceptCaption = "OK";
        g_call.cancelCaption = "CANCEL";
        HostApi api;
        SetHostApi(api);
    }
    void TearDown() override {
        DestroyDocument();
        std::remove(ExplorerSettingsPath().c_str());
        // The run dialog sets the thumbnails' double-click time; the library's run puts the user's back.
        if (::GetDoubleClickTime() != m_doubleClickTime)
            ::SetDoubleClickTime(m_doubleClickTime);
    }

    // Writes the explorer's settings file that the next run's document reads.
    static void WriteSettings(const std::string& text) {
        std::ofstream(ExplorerSettingsPath(), std::ios::binary) << text;
    }
    static void DestroyDocument() {
        delete g_pTessel3Doc;
        g_pTessel3Doc = nullptr;
    }

    const UINT m_doubleClickTime = ::GetDoubleClickTime();

    INT_PTR Run(RunDialog& dialog) {
        const INT_PTR result = dialog.DoModal();
        testsupport::PumpMessages(); // posted commands and idle updates have run
        EXPECT_TRUE(dialog.created);
        EXPECT_EQ(g_app.ExplorerFrame(), nullptr) << "the frame goes with the dialog";
        return result;
    }

    // Opens the explorer, reads one text of it, closes it (the run ends cancelled) and gives the text.
    std::string TextWhileOpen(const std::function<std::string(CMainFrame&)>& read) {
        RunDialog dialog;
        std::string text;
        dialog.steps.push_back([&](CMainFrame& frame) {
            text = read(frame);
            frame.PostMessage(WM_CLOSE);
        });
        EXPECT_EQ(Run(dialog), 2);
        return text;
    }
};

} // namespace

TEST_F(ExplorerFrame, MenuHasEveryItemWithItsCommand) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        HMENU menu = frame.GetMenu();
        ASSERT_NE(menu, nullptr);
        ASSERT_EQ(::GetMenuItemCount(menu), 4);
        EXPECT_EQ(MenuText(menu, 0, MF_BYPOSITION), "&File");
        EXPECT_EQ(MenuText(menu, 1, MF_BYPOSITION), "&View");
        EXPECT_EQ(MenuText(menu, 2, MF_BYPOSITION), "&Sort");
        EXPECT_EQ(MenuText(menu, 3, MF_BYPOSITION), "&Help");
        const struct {
            UINT id;
            const char* text;
        } items[] = {{57665, "E&xit"},     {59392, "&Toolbar"},  {59393, "&Status Bar"}, {32771, "&Begin"},
                     {32774, "&Increase"}, {32775, "&Decrease"}, {32782, "&Aligne"},     {32799, "By &Name"},
                     {32788, "By &Date"},  {32789, "By &Size"},  {57664, "&About"},      {57670, "&Help"}};
        for (const auto& item : items)
            EXPECT_EQ(MenuText(menu, item.id, MF_BYCOMMAND), item.text) << item.id;
        EXPECT_EQ(::GetSubMenu(menu, 3) ? ::GetMenuItemID(::GetSubMenu(menu, 3), 1) : 0u, 57670u);
        EXPECT_TRUE(::GetMenuState(menu, 57670, MF_BYCOMMAND) & MF_GRAYED);
        EXPECT_FALSE(::GetMenuState(menu, 57664, MF_BYCOMMAND) & MF_GRAYED);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, TitleNamesTheExplorerInsteadOfUntitled) {
    RunDialog dialog;
    std::string title;
    dialog.steps.push_back([&](CMainFrame& frame) {
        title = frame.GetWindowText();
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_NE(title.find("Kelmar Dwg Thumbnail Explorer"), std::string::npos) << title;
    EXPECT_EQ(title.find("Untitled"), std::string::npos) << title;
}

TEST_F(ExplorerFrame, PlaceholdersBecomeSeparatorsHoldingTheSearchControls) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CToolBar& bar = frame.GetMainToolBar();
        for (UINT id : {ID_SEARCH_LABEL, ID_SEARCH_EDIT, ID_LAYER_LABEL}) {
            const int index = bar.CommandToIndex(id);
            ASSERT_GE(index, 0) << id;
            EXPECT_EQ(bar.GetButtonStyle(index) & TBBS_SEPARATOR, TBBS_SEPARATOR) << id;
        }
        const CRect searchSep = ItemRect(bar, ID_SEARCH_LABEL);
        EXPECT_EQ(searchSep.Width(), frame.MeasureLabelText("Search:").cx + 1);
        EXPECT_EQ(frame.GetSearchLabel().GetWindowText(), "Search:");
        EXPECT_EQ(RectInParent(frame.GetSearchLabel()), searchSep);

        const CRect editSep = ItemRect(bar, ID_SEARCH_EDIT);
        EXPECT_EQ(editSep.Width(), 125);
        const CRect edit = RectInParent(frame.GetSearchEdit());
        const int border = ::GetSystemMetrics(SM_CXEDGE);
        EXPECT_EQ(edit.left, editSep.left + border);
        EXPECT_EQ(edit.right, editSep.right - border);
        EXPECT_EQ(edit.Height(), frame.MeasureLabelText("Search:").cy);
        EXPECT_LE(std::abs((edit.top - editSep.top) - (editSep.bottom - edit.bottom)), 1);
        EXPECT_EQ(::GetParent(frame.GetSearchEdit().m_hWnd), bar.m_hWnd);
        EXPECT_TRUE(frame.GetSearchEdit().GetStyle() & ES_AUTOHSCROLL);
        EXPECT_FALSE(frame.GetSearchEdit().GetStyle() & WS_BORDER);

        const CRect layerSep = ItemRect(bar, ID_LAYER_LABEL);
        EXPECT_EQ(layerSep.Width(), frame.MeasureLabelText(" Layer name:").cx + 1000);
        EXPECT_EQ(RectInParent(frame.GetLayerLabel()), layerSep);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, BottomToolbarCarriesTheCaptionsAndStartsWithoutAPick) {
    g_call.acceptCaption = "Insert";
    g_call.cancelCaption = "Leave";
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CToolBar& bar = frame.GetPickToolBar();
        EXPECT_EQ(frame.GetAcceptLabel().GetWindowText(), "Insert");
        EXPECT_EQ(frame.GetCancelLabel().GetWindowText(), "Leave");
        for (auto [id, label] : {std::pair<UINT, CStatic*>{ID_ACCEPT, &frame.GetAcceptLabel()},
                                 std::pair<UINT, CStatic*>{ID_CANCEL_PICK, &frame.GetCancelLabel()}}) {
            const CRect button = ItemRect(bar, id);
            const CRect rc = RectInParent(*label);
            const CSize text = frame.MeasureLabelText(label->GetWindowText());
            EXPECT_EQ(rc.Width(), text.cx);
            EXPECT_EQ(rc.Height(), text.cy);
            EXPECT_LE(std::abs((rc.left - button.left) - (button.right - rc.right)), 1) << id;
            EXPECT_LE(std::abs((rc.top - button.top) - (button.bottom - rc.bottom)), 1) << id;
        }
        // The bottom toolbar sits at the bottom of the frame, above the status bar.
        const CRect frameClient = frame.GetClientRect();
        const CRect status = RectInParent(frame.GetStatusBar());
        const CRect bottomBar = RectInParent(bar);
        EXPECT_EQ(status.bottom, frameClient.bottom);
        EXPECT_EQ(bottomBar.bottom, status.top);
        EXPECT_EQ(frame.GetStatusBar().GetCount(), 4);

        EXPECT_FALSE(frame.IsPickEnabled());
        EXPECT_FALSE(bar.GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        EXPECT_FALSE(frame.GetAcceptLabel().IsWindowEnabled());
        EXPECT_TRUE(bar.GetToolBarCtrl().IsButtonEnabled(ID_CANCEL_PICK));
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        // Still disabled after the idle updates ran.
        EXPECT_FALSE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        frame.EnablePick(true);
        EXPECT_TRUE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        EXPECT_TRUE(frame.GetAcceptLabel().IsWindowEnabled());
        frame.GetPickToolBar().PostMessage(WM_COMMAND, MAKEWPARAM(ID_CANCEL_PICK, BN_CLICKED),
                                           reinterpret_cast<LPARAM>(frame.GetPickToolBar().m_hWnd));
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, EscapeInTheSearchEditCancels) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        frame.GetSearchEdit().SetFocus();
        frame.GetSearchEdit().PostMessage(WM_KEYDOWN, VK_ESCAPE, 0x00010001);
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, ClickInTheSearchEditEmptiesItAndMakesItWritable) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CEditSearch& edit = frame.GetSearchEdit();
        edit.SetWindowText("abc");
        edit.SetReadOnly(true);
        edit.PostMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(3, 3));
        edit.PostMessage(WM_LBUTTONUP, 0, MAKELPARAM(3, 3));
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        CEditSearch& edit = frame.GetSearchEdit();
        EXPECT_EQ(edit.GetWindowText(), "");
        EXPECT_FALSE(edit.GetStyle() & ES_READONLY);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, CloseBoxCancelsAndStoresTheFrameSize) {
    WriteSettings("[Size]\r\nSplitterSize=140\r\nWindowWidth=640\r\nWindowHeight=480\r\n");
    RunDialog dialog;
    CRect before;
    int splitter = 0;
    dialog.beforeCreate = [&] { ::MoveWindow(dialog.m_hWnd, 300, 300, 100, 60, FALSE); };
    dialog.steps.push_back([&](CMainFrame& frame) {
        EXPECT_FALSE(::IsZoomed(frame.m_hWnd));
        frame.MoveWindow(50, 60, 700, 500);
        before = frame.GetWindowRect();
        int minimum = 0;
        frame.GetSplitter().GetColumnInfo(0, splitter, minimum);
        frame.PostMessage(WM_SYSCOMMAND, SC_CLOSE, 0);
    });
    EXPECT_EQ(Run(dialog), 2);
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_nWindowWidth, 700);
    EXPECT_EQ(g_pTessel3Doc->m_nWindowHeight, 500);
    EXPECT_EQ(splitter, 140);
    EXPECT_EQ(g_pTessel3Doc->m_nSplitterSize, 140);
}

TEST_F(ExplorerFrame, StoredSizeIsPlacedByTheFormula) {
    WriteSettings("[Size]\r\nWindowWidth=400\r\nWindowHeight=300\r\n");
    RunDialog dialog;
    CRect dialogRect;
    dialog.beforeCreate = [&] {
        ::MoveWindow(dialog.m_hWnd, 300, 200, 200, 100, FALSE);
        dialogRect = dialog.GetWindowRect();
    };
    dialog.steps.push_back([&](CMainFrame& frame) {
        const CRect rc = frame.GetWindowRect();
        EXPECT_FALSE(::IsZoomed(frame.m_hWnd));
        EXPECT_TRUE(frame.IsWindowVisible());
        EXPECT_EQ(rc.left, (dialogRect.left + dialogRect.right) / 2 - 200);
        EXPECT_EQ(rc.top,
                  (dialogRect.top + dialogRect.bottom) / 2 - (300 - dialogRect.top + dialogRect.bottom) / 2);
        EXPECT_EQ(rc.Width(), 400);
        EXPECT_EQ(rc.Height(), 300);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

TEST_F(ExplorerFrame, NoStoredSizeWithTheDialogAtTheTopLeftOpensMaximised) {
    WriteSettings("[Size]\r\nWindowWidth=0\r\nWindowHeight=0\r\n");
    RunDialog dialog;
    dialog.beforeCreate = [&] { ::MoveWindow(dialog.m_hWnd, 0, 0, 0, 0, FALSE); };
    dialog.steps.push_back([](CMainFrame& frame) {
        EXPECT_TRUE(::IsZoomed(frame.m_hWnd));
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

namespace {

// The frame's rectangle of a run with a stored size, the dialog at (300, 200) as 200 x 100.
CRect FrameRectForStoredSize(const std::string& width, const std::string& height, bool& zoomed) {
    std::ofstream(ExplorerSettingsPath(), std::ios::binary)
        << "[Size]\r\nWindowWidth=" << width << "\r\nWindowHeight=" << height << "\r\n";
    RunDialog dialog;
    CRect rc;
    dialog.beforeCreate = [&] { ::MoveWindow(dialog.m_hWnd, 300, 200, 200, 100, FALSE); };
    dialog.steps.push_back([&](CMainFrame& frame) {
        rc = frame.GetWindowRect();
        zoomed = ::IsZoomed(frame.m_hWnd) != FALSE;
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(dialog.DoModal(), 2);
    testsupport::PumpMessages();
    delete g_pTessel3Doc;
    g_pTessel3Doc = nullptr;
    return rc;
}

} // namespace

TEST_F(ExplorerFrame, StoredSizesTheDesktopCannotShowGiveTheFirstRunPlacement) {
    bool zoomed = false;
    const CRect firstRun = FrameRectForStoredSize("0", "0", zoomed);
    ASSERT_GT(firstRun.Width(), 0);
    const RECT screen{::GetSystemMetrics(SM_XVIRTUALSCREEN), ::GetSystemMetrics(SM_YVIRTUALSCREEN),
                      ::GetSystemMetrics(SM_XVIRTUALSCREEN) + ::GetSystemMetrics(SM_CXVIRTUALSCREEN),
                      ::GetSystemMetrics(SM_YVIRTUALSCREEN) + ::GetSystemMetrics(SM_CYVIRTUALSCREEN)};
    const struct {
        const char* width;
        const char* height;
    } cases[] = {
        {"-500", "300"},       // a negative side
        {"400", "-3000"},      // would open far below the screen
        {"-2147483648", "-1"}, // the most negative
        {"100000", "300"},     // wider than the screen
        {"2147483647", "2147483647"},
    };
    for (const auto& c : cases) {
        const CRect rc = FrameRectForStoredSize(c.width, c.height, zoomed);
        EXPECT_EQ(rc, firstRun) << c.width << " x " << c.height;
        EXPECT_FALSE(zoomed) << c.width << " x " << c.height;
        CRect onScreen;
        EXPECT_TRUE(::IntersectRect(&onScreen, &rc, &screen)) << c.width << " x " << c.height;
    }
    // A size the screen can show keeps its place.
    const CRect kept = FrameRectForStoredSize("400", "300", zoomed);
    EXPECT_EQ(kept.Width(), 400);
    EXPECT_EQ(kept.Height(), 300);
}

TEST_F(ExplorerFrame, SortCommandsSetTheModeAndCheckTheirItems) {
    WriteSettings("[View]\r\nSort=2\r\n");
    RunDialog dialog;
    auto checked = [](CMainFrame& frame, UINT id) {
        HMENU sort = ::GetSubMenu(frame.GetMenu(), 2);
        frame.SendMessage(WM_INITMENUPOPUP, reinterpret_cast<WPARAM>(sort), 2);
        return (::GetMenuState(sort, id, MF_BYCOMMAND) & MF_CHECKED) != 0;
    };
    dialog.steps.push_back([&](CMainFrame& frame) {
        EXPECT_EQ(frame.GetSortMode(), 2);
        EXPECT_TRUE(checked(frame, ID_SORT_SIZE));
        EXPECT_FALSE(checked(frame, ID_SORT_NAME));
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_SORT_DATE, 0), 0);
        EXPECT_EQ(frame.GetSortMode(), 1);
        EXPECT_TRUE(checked(frame, ID_SORT_DATE));
        EXPECT_FALSE(checked(frame, ID_SORT_SIZE));
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_SORT_NAME, 0), 0);
        EXPECT_EQ(frame.GetSortMode(), 0);
        EXPECT_TRUE(checked(frame, ID_SORT_NAME));
        EXPECT_FALSE(checked(frame, ID_SORT_DATE));
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_SORT_DATE, 0), 0);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_nSort, 1) << "the frame's sort mode goes back into the settings";
}

TEST_F(ExplorerFrame, LayerLabelShowsTheStartFolderLayer) {
    const std::string folder = TempFolder("orvex-frame-layer");
    std::ofstream(folder + "\\datains.ini", std::ios::binary)
        << "[Default Parameters]\r\nLayer=Walls\r\nColor=3\r\nLisp command=\r\n";
    g_call.startPath = folder + "\\plan.dwg";
    EXPECT_EQ(TextWhileOpen([](CMainFrame& frame) { return frame.GetLayerLabel().GetWindowText(); }),
              " Layer name: Walls");
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_strPath, folder);
    std::remove((folder + "\\datains.ini").c_str());
    ::RemoveDirectoryA(folder.c_str());
}

TEST_F(ExplorerFrame, LayerLabelSaysCurrentWithoutDatainsIni) {
    const std::string folder = TempFolder("orvex-frame-nolayer");
    WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\n");
    EXPECT_EQ(TextWhileOpen([](CMainFrame& frame) { return frame.GetLayerLabel().GetWindowText(); }),
              " Layer name: Current");
    ::RemoveDirectoryA(folder.c_str());
}

TEST_F(ExplorerFrame, AcceptNeedsAChosenDrawing) {
    // The drawing is there: the run dialog hands back only a file that exists.
    const std::string folder = TempFolder("orvex-frame-accept");
    std::ofstream(folder + "\\plan.dwg", std::ios::binary) << "";
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        // No drawing chosen: the accept command does nothing.
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, 0), 0);
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        DrawingFolder* drawings = g_app.Folder();
        ASSERT_NE(drawings, nullptr);
        drawings->Choose(drawings->Find("plan.dwg"));
        ASSERT_EQ(drawings->Chosen(), 0);
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, 0), 0);
    });
    EXPECT_EQ(Run(dialog), 1);
    std::remove((folder + "\\plan.dwg").c_str());
    ::RemoveDirectoryA(folder.c_str());
}

TEST_F(ExplorerFrame, SavedDrawingNameStartsTheSearch) {
    // In the folder it was chosen in, which the explorer opens on.
    WriteSettings("[CurrentPath]\r\nPath=" + TempFolder("orvex-frame-saved") + "\r\nName=plan-b.dwg\r\n");
    EXPECT_EQ(TextWhileOpen([](CMainFrame& frame) { return frame.GetSearchEdit().GetWindowText(); }),
              "plan-b");
}

TEST_F(ExplorerFrame, SavedDrawingNameOfAnyLengthStartsTheSearch) {
    const std::string stem(1500, 'p'); // far beyond a file-name buffer, within an ini line
    WriteSettings("[CurrentPath]\r\nPath=" + TempFolder("orvex-frame-saved-long") + "\r\nName=C:\\x\\" +
                  stem + ".dwg\r\n");
    EXPECT_EQ(TextWhileOpen([](CMainFrame& frame) { return frame.GetSearchEdit().GetWindowText(); }), stem);
}

TEST_F(ExplorerFrame, TheDrawingOfTheLastRunIsChosenOnlyInItsOwnFolder) {
    const std::string saved = TempFolder("orvex-frame-saved-here");
    const std::string other = TempFolder("orvex-frame-saved-other");
    for (const std::string& folder : {saved, other})
        std::ofstream(folder + "\\plan.dwg", std::ios::binary) << "";
    WriteSettings("[CurrentPath]\r\nPath=" + saved + "\r\nName=plan.dwg\r\n");
    g_call.startPath = other + "\\";
    RunDialog dialog;
    std::string text;
    int chosen = 0;
    dialog.steps.push_back([&](CMainFrame& frame) {
        text = frame.GetSearchEdit().GetWindowText();
        chosen = g_app.Folder() ? g_app.Folder()->Chosen() : 0;
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(text, "") << "another folder's plan.dwg is another drawing";
    EXPECT_EQ(chosen, -1);
    std::remove((saved + "\\plan.dwg").c_str());
    std::remove((other + "\\plan.dwg").c_str());
}

TEST_F(ExplorerFrame, HostFrameIsDisabledWhileTheExplorerIsOpen) {
    static HWND s_host = nullptr;
    CWnd host;
    ASSERT_TRUE(host.CreateEx(0, nullptr, "host", WS_OVERLAPPEDWINDOW, CRect(0, 0, 200, 100), nullptr, 0));
    s_host = host.m_hWnd;
    HostApi api;
    api.acedGetAcadFrame = [] { return s_host; };
    SetHostApi(api);
    RunDialog dialog;
    dialog.hostFrame = host.m_hWnd;
    dialog.steps.push_back([](CMainFrame& frame) { frame.PostMessage(WM_CLOSE); });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_TRUE(dialog.hostDisabledDuringRun);
    host.DestroyWindow();
}

TEST_F(ExplorerFrame, ClearCommandClearsTheFocusWindowSelection) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CEditSearch& edit = frame.GetSearchEdit();
        edit.SetWindowText("abcdef");
        edit.SetFocus();
        edit.SetSel(0, 3);
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_CLEAR, 1), 0);
        EXPECT_EQ(edit.GetWindowText(), "def");
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
}

namespace {

// A folder with empty drawing files: enough for the scan, the search and the pick.
std::string FolderWithDrawings(const char* name, std::initializer_list<const char*> files) {
    const std::string folder = TempFolder(name);
    for (const char* file : files)
        std::ofstream(folder + "\\" + file, std::ios::binary) << "";
    return folder;
}

void RemoveFolder(const std::string& folder, std::initializer_list<const char*> files) {
    for (const char* file : files)
        std::remove((folder + "\\" + file).c_str());
    ::RemoveDirectoryA(folder.c_str());
}

} // namespace

TEST_F(ExplorerFrame, TypingAPrefixChoosesTheDrawingAndAcceptTakesIt) {
    const auto files = {"abc.dwg", "xyz.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-search", files);
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        EXPECT_FALSE(frame.IsPickEnabled());
        CEditSearch& edit = frame.GetSearchEdit();
        edit.SetFocus();
        edit.PostMessage(WM_CHAR, 'A', 1);
        edit.PostMessage(WM_CHAR, 'B', 1);
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        EXPECT_EQ(frame.GetSearchEdit().GetWindowText(), "AB");
        ASSERT_NE(g_pTessel3Doc, nullptr);
        EXPECT_EQ(g_pTessel3Doc->m_strName, "abc.dwg");
        EXPECT_TRUE(frame.IsPickEnabled());
        EXPECT_TRUE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        frame.GetPickToolBar().PostMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, BN_CLICKED),
                                           reinterpret_cast<LPARAM>(frame.GetPickToolBar().m_hWnd));
    });
    EXPECT_EQ(Run(dialog), 1);
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_strPath, folder);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "abc.dwg");
    RemoveFolder(folder, files);
}

// The run dialog hands back only a drawing that is still there: accepting one deleted meanwhile says so,
// and the explorer stays open for another choice.
TEST_F(ExplorerFrame, AcceptOfADrawingDeletedMeanwhileIsRefusedAndTheExplorerStaysOpen) {
    const auto files = {"abc.dwg", "xyz.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-deleted", files);
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    std::string said;
    bool stillOpen = false;
    dialog.steps.push_back([](CMainFrame& frame) {
        CEditSearch& edit = frame.GetSearchEdit();
        edit.SetFocus();
        edit.PostMessage(WM_CHAR, 'a', 1);
    });
    dialog.steps.push_back([&](CMainFrame& frame) {
        ASSERT_NE(g_pTessel3Doc, nullptr);
        EXPECT_EQ(g_pTessel3Doc->m_strName, "abc.dwg");
        std::remove((folder + "\\abc.dwg").c_str());
        // Sent, so that the accept is queued before the next step, which runs in the message box's loop.
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, 0), 0);
    });
    dialog.steps.push_back([&](CMainFrame&) {
        // Runs inside the message box's own loop.
        HWND box = ::FindWindowA("#32770", "Orvex1");
        ASSERT_NE(box, nullptr) << "the refusal is said in a message box";
        char text[1024] = "";
        ::GetDlgItemTextA(box, 0xFFFF, text, sizeof text); // the message box's text
        said = text;
        ::PostMessageA(box, WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED), 0);
    });
    dialog.steps.push_back([&](CMainFrame& frame) {
        stillOpen = frame.IsWindowVisible();
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_TRUE(stillOpen);
    // A path longer than a line of the box is broken in lines.
    EXPECT_EQ(said,
              BreakLongWords("The drawing\n" + folder + "\\abc.dwg\nno longer exists. Choose another one.",
                             kMessageWordChars));
    RemoveFolder(folder, files);
}

TEST_F(ExplorerFrame, SavedDrawingIsChosenAgainAndTheAcceptButtonTakesIt) {
    // "plan" starts plan-a.dwg first; the saved drawing is plan.dwg.
    const auto files = {"plan-a.dwg", "plan.dwg", "zeta.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-saved", files);
    WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\nName=plan.dwg\r\n");
    RunDialog dialog;
    std::string text, title;
    dialog.steps.push_back([&](CMainFrame& frame) {
        text = frame.GetSearchEdit().GetWindowText();
        title = frame.GetWindowText();
        ASSERT_NE(g_pTessel3Doc, nullptr);
        EXPECT_EQ(g_pTessel3Doc->m_strName, "plan.dwg");
        EXPECT_TRUE(frame.IsPickEnabled());
        EXPECT_TRUE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        // Still chosen after the idle updates ran.
        EXPECT_TRUE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        frame.GetPickToolBar().PostMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, BN_CLICKED),
                                           reinterpret_cast<LPARAM>(frame.GetPickToolBar().m_hWnd));
    });
    EXPECT_EQ(Run(dialog), 1);
    EXPECT_EQ(text, "plan");
    EXPECT_EQ(title, folder + "\\plan.dwg");
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "plan.dwg");
    RemoveFolder(folder, files);
}

// The keyboard starts in the folder tree, on the start folder the tree walked to, also when the grid has
// scrolled to the saved drawing (it lays rows out with the focus, and gives it back).
TEST_F(ExplorerFrame, TheKeyboardStartsInTheTreeAlsoWhenTheGridScrollsToTheSavedDrawing) {
    const std::string folder = TempFolder("orvex-frame-focus");
    std::vector<std::string> names;
    for (int i = 0; i < 200; ++i) {
        char name[32];
        std::snprintf(name, sizeof name, "d%03d.dwg", i);
        names.push_back(name);
        std::ofstream(folder + "\\" + name, std::ios::binary) << "";
    }
    for (const std::string& saved : {std::string(), std::string("d199.dwg")}) {
        SCOPED_TRACE(saved.empty() ? "no saved drawing" : saved);
        WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\nName=" + saved + "\r\n");
        RunDialog dialog;
        HWND focus = nullptr, tree = nullptr;
        int firstRow = -1;
        std::string selected;
        dialog.steps.push_back([&](CMainFrame& frame) {
            focus = ::GetFocus();
            firstRow = frame.GetGridView()->GetFirstRow();
            ASSERT_NE(frame.GetFolderTree(), nullptr);
            tree = frame.GetFolderTree()->m_hWnd;
            selected = frame.GetFolderTree()->FolderPathOf(frame.GetFolderTree()->GetSelectedItem());
            frame.PostMessage(WM_CLOSE);
        });
        Run(dialog);
        EXPECT_EQ(lstrcmpiA(selected.c_str(), folder.c_str()), 0) << selected;
        EXPECT_EQ(focus, tree);
        if (saved.empty())
            EXPECT_EQ(firstRow, 0);
        else
            EXPECT_GT(firstRow, 0) << "the grid scrolled to the saved drawing";
        DestroyDocument();
    }
    for (const std::string& name : names)
        std::remove((folder + "\\" + name).c_str());
    ::RemoveDirectoryA(folder.c_str());
}

TEST_F(ExplorerFrame, SavedDrawingStaysChosenForTheAcceptMessage) {
    const auto files = {"abc.dwg", "plan.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-saved-msg", files);
    WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\nName=plan.dwg\r\n");
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame&) { PostAppResult(kAppAccept); });
    EXPECT_EQ(Run(dialog), 1);
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_strName, "plan.dwg");
    RemoveFolder(folder, files);
}

TEST_F(ExplorerFrame, ASavedDrawingNoLongerThereChoosesNothing) {
    const auto files = {"abc.dwg", "xyz.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-saved-gone", files);
    WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\nName=plan.dwg\r\n");
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        ASSERT_NE(g_pTessel3Doc, nullptr);
        EXPECT_EQ(g_pTessel3Doc->m_strName, "");
        EXPECT_FALSE(frame.IsPickEnabled());
        EXPECT_FALSE(frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT));
        // The accept button does nothing without a drawing.
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, 0), 0);
    });
    dialog.steps.push_back([](CMainFrame& frame) { frame.PostMessage(WM_CLOSE); });
    EXPECT_EQ(Run(dialog), 2);
    RemoveFolder(folder, files);
}

TEST_F(ExplorerFrame, TypingWhatNoNameStartsWithChoosesNothingAndSaysSo) {
    const auto files = {"abc.dwg", "xyz.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-nomatch", files);
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CEditSearch& edit = frame.GetSearchEdit();
        edit.SetFocus();
        edit.PostMessage(WM_CHAR, 'x', 1);
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        ASSERT_NE(g_pTessel3Doc, nullptr);
        EXPECT_EQ(g_pTessel3Doc->m_strName, "xyz.dwg");
        EXPECT_TRUE(frame.IsPickEnabled());
        frame.GetSearchEdit().PostMessage(WM_CHAR, 'q', 1);
    });
    std::string title, status;
    bool pick = true, button = true;
    dialog.steps.push_back([&](CMainFrame& frame) {
        EXPECT_EQ(g_pTessel3Doc->m_strName, "");
        pick = frame.IsPickEnabled();
        button = frame.GetPickToolBar().GetToolBarCtrl().IsButtonEnabled(ID_ACCEPT);
        title = frame.GetWindowText();
        status = frame.GetStatusBar().GetPaneText(0);
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_ACCEPT, 0), 0); // does nothing
    });
    dialog.steps.push_back([](CMainFrame& frame) { frame.PostMessage(WM_CLOSE); });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_FALSE(pick);
    EXPECT_FALSE(button);
    EXPECT_EQ(title, folder);
    EXPECT_EQ(status, "No drawing starts with \"xq\"");
    RemoveFolder(folder, files);
}

TEST_F(ExplorerFrame, AFolderPathTooLongForTheScanIsSaidInTheStatusBar) {
    const std::string folder = "C:\\" + std::string(1000, 'd');
    WriteSettings("[CurrentPath]\r\nPath=" + folder + "\r\n");
    RunDialog dialog;
    std::string status;
    dialog.steps.push_back([&](CMainFrame& frame) {
        status = frame.GetStatusBar().GetPaneText(0);
        CTessel3View* grid = frame.GetGridView();
        EXPECT_NE(grid, nullptr);
        if (grid) {
            EXPECT_EQ(grid->GetRows(), 0);
        }
        frame.PostMessage(WM_CLOSE); // also after a miss, so that the run ends
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(status,
              "The folder cannot be read: its path is 1003 characters long, at most 257 are possible");
}

TEST_F(ExplorerFrame, GridCommandsAreForwardedToTheGrid) {
    RunDialog dialog;
    int before = 0, after = 0;
    dialog.steps.push_back([&](CMainFrame& frame) {
        ASSERT_NE(frame.GetGridView(), nullptr);
        before = frame.GetGridView()->GetPictureWidth();
        // Through the accelerator table and the menu alike the command reaches the frame first.
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_VIEW_INCREASE, 0), 0);
        after = frame.GetGridView()->GetPictureWidth();
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_GT(after, before);
    ASSERT_NE(g_pTessel3Doc, nullptr);
    EXPECT_EQ(g_pTessel3Doc->m_nPictureWidth, after) << "the picture size goes back into the settings";
}

TEST_F(ExplorerFrame, AboutBoxShowsItsTitleAndText) {
    RunDialog dialog;
    std::string text;
    std::string versionLine;
    bool found = false;
    dialog.steps.push_back(
        [](CMainFrame& frame) { frame.PostMessage(WM_COMMAND, MAKEWPARAM(ID_APP_ABOUT, 0), 0); });
    dialog.steps.push_back([&](CMainFrame&) {
        // Runs inside the about box's own modal loop.
        HWND about = ::FindWindowA(nullptr, "About Orvex1");
        found = about != nullptr;
        if (!about)
            return;
        char buffer[64] = "";
        ::GetDlgItemTextA(about, IDC_ABOUT_TEXT, buffer, sizeof buffer);
        text = buffer;
        char line[128] = "";
        ::GetDlgItemTextA(about, IDC_ABOUT_VERSION, line, sizeof line);
        versionLine = line;
        ::PostMessageA(about, WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED), 0);
    });
    dialog.steps.push_back([](CMainFrame& frame) {
        EXPECT_EQ(::FindWindowA(nullptr, "About Orvex1"), nullptr);
        frame.PostMessage(WM_COMMAND, MAKEWPARAM(ID_APP_EXIT, 0), 0);
    });
    EXPECT_EQ(Run(dialog), 2) << "Exit closes the frame, which cancels";
    EXPECT_TRUE(found);
    EXPECT_EQ(text, "Orvex1");
    // The second line names the build: the project's version and the commit (12 hex digits, or "unknown"
    // for a build outside a repository).
    const std::string prefix = "Version " ORVEX_VERSION_TEXT " (commit ";
    ASSERT_EQ(versionLine.compare(0, prefix.size(), prefix), 0) << versionLine;
    ASSERT_EQ(versionLine.back(), ')') << versionLine;
    const std::string commit = versionLine.substr(prefix.size(), versionLine.size() - prefix.size() - 1);
    if (commit != "unknown") {
        EXPECT_EQ(commit.size(), 12u) << versionLine;
        EXPECT_EQ(commit.find_first_not_of("0123456789abcdef"), std::string::npos) << versionLine;
    }
}

TEST_F(ExplorerFrame, CancelButtonOfTheBottomToolbarCancelsByMouse) {
    RunDialog dialog;
    dialog.steps.push_back([](CMainFrame& frame) {
        CToolBar& bar = frame.GetPickToolBar();
        CRect rc;
        bar.GetItemRect(bar.CommandToIndex(ID_CANCEL_PICK), &rc);
        // The caption label lies over the button but lets the mouse through to it.
        const CPoint at = rc.CenterPoint();
        CPoint screen = at;
        bar.ClientToScreen(&screen);
        EXPECT_EQ(::WindowFromPoint(screen), bar.m_hWnd);
        bar.PostMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(at.x, at.y));
        bar.PostMessage(WM_LBUTTONUP, 0, MAKELPARAM(at.x, at.y));
    });
    EXPECT_EQ(Run(dialog), 2);
}

// Every key of the accelerator table does something: its command reaches a handler of the frame or of
// the grid (a command no one takes is a key that does nothing).
TEST_F(ExplorerFrame, EveryAcceleratorReachesAHandler) {
    const auto files = {"one.dwg", "two.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-accel", files);
    g_call.startPath = folder + "\\";
    HACCEL table = ::LoadAcceleratorsA(AfxGetResourceHandle(), MAKEINTRESOURCEA(IDR_MAINFRAME));
    ASSERT_NE(table, nullptr);
    ACCEL entries[64];
    const int count = ::CopyAcceleratorTableA(table, entries, 64);
    ::DestroyAcceleratorTable(table);
    ASSERT_GT(count, 0);
    // Paste first, with nothing on the clipboard, and select all last: nothing is copied into the folder.
    std::vector<UINT> commands;
    for (int i = 0; i < count; ++i)
        commands.push_back(entries[i].cmd);
    std::stable_sort(commands.begin(), commands.end(), [](UINT a, UINT b) {
        const auto rank = [](UINT id) { return id == ID_EDIT_PASTE ? 0 : id == ID_SELECT_ALL ? 2 : 1; };
        return rank(a) < rank(b);
    });
    if (::OpenClipboard(nullptr)) {
        ::EmptyClipboard();
        ::CloseClipboard();
    }
    std::vector<UINT> unhandled;
    RunDialog dialog;
    dialog.steps.push_back([&](CMainFrame& frame) {
        for (UINT id : commands)
            if (!static_cast<CWnd&>(frame).OnCmdMsg(id, 0))
                unhandled.push_back(id);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(unhandled, std::vector<UINT>{}) << "commands of the accelerator table that nothing handles";
    RemoveFolder(folder, files);
}

// F6 and Shift+F6 take the keyboard from the tree to the grid and back.
TEST_F(ExplorerFrame, NextAndPreviousPaneMoveTheFocusBetweenTreeAndGrid) {
    RunDialog dialog;
    std::vector<HWND> foci;
    HWND tree = nullptr, grid = nullptr;
    dialog.steps.push_back([&](CMainFrame& frame) {
        ASSERT_NE(frame.GetFolderTree(), nullptr);
        ASSERT_NE(frame.GetGridView(), nullptr);
        tree = frame.GetFolderTree()->m_hWnd;
        grid = frame.GetGridView()->m_hWnd;
        ::SetFocus(tree);
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_NEXT_PANE, 1), 0);
        foci.push_back(::GetFocus());
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_PREV_PANE, 1), 0);
        foci.push_back(::GetFocus());
        frame.SendMessage(WM_COMMAND, MAKEWPARAM(ID_PREV_PANE, 1), 0);
        foci.push_back(::GetFocus());
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(foci, (std::vector<HWND>{grid, tree, grid}));
}

// A first run: no settings, no start folder. The layer label already says where a pick goes.
TEST_F(ExplorerFrame, FirstRunLayerLabelSaysCurrent) {
    EXPECT_EQ(TextWhileOpen([](CMainFrame& frame) { return frame.GetLayerLabel().GetWindowText(); }),
              " Layer name: Current");
}

// The status bar says how many drawings the folder holds, and comes back to it after a prompt.
TEST_F(ExplorerFrame, StatusBarCountsTheDrawingsOfTheFolder) {
    const auto files = {"a.dwg", "b.dwg", "c.dwg"};
    const std::string folder = FolderWithDrawings("orvex-frame-count", files);
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    std::string shown, idle;
    dialog.steps.push_back([&](CMainFrame& frame) {
        shown = frame.GetStatusBar().GetPaneText(0);
        idle = frame.GetIdleMessage();
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(shown, "3 drawings");
    EXPECT_EQ(idle, "3 drawings");
    EXPECT_EQ(DrawingCountText(0), "No drawings");
    EXPECT_EQ(DrawingCountText(1), "1 drawing");
    EXPECT_EQ(DrawingCountText(12345), "12345 drawings");
    RemoveFolder(folder, files);
}

// The status bar while a slow folder is read: the one ellipsis character where the code page has it.
TEST(ScanningText, CountsTheDrawingsFoundWithTheCodePagesEllipsis) {
    // The Western code page has the ellipsis as one byte; a code page without it would show three dots.
    if (::GetACP() != 1252)
        GTEST_SKIP() << "the expected texts are those of the Western code page";
    EXPECT_EQ(ScanningText(0), "Reading the folder\x85 0 drawings");
    EXPECT_EQ(ScanningText(1), "Reading the folder\x85 1 drawing");
    EXPECT_EQ(ScanningText(178838), "Reading the folder\x85 178838 drawings");
}

// A start folder that is not there: the status bar says so, and the title does not name it as open.
TEST_F(ExplorerFrame, AStartFolderThatDoesNotExistIsSaidAndNotShownAsOpen) {
    const std::string folder = TempFolder("orvex-frame-gone") + "\\not-there";
    g_call.startPath = folder + "\\";
    RunDialog dialog;
    std::string status, title, idle;
    dialog.steps.push_back([&](CMainFrame& frame) {
        status = frame.GetStatusBar().GetPaneText(0);
        title = frame.GetWindowText();
        idle = frame.GetIdleMessage();
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    EXPECT_EQ(status, "The folder cannot be read: " + folder + " does not exist");
    EXPECT_EQ(idle, status) << "the status bar comes back to it";
    EXPECT_EQ(title.find("not-there"), std::string::npos) << title;
}

TEST_F(ExplorerFrame, AStartFolderThatIsAFileIsSaid) {
    const std::string file = TempFolder("orvex-frame-file") + "\\plain";
    std::ofstream(file, std::ios::binary) << "x";
    g_call.startPath = file + "\\";
    RunDialog dialog;
    std::string status;
    dialog.steps.push_back([&](CMainFrame& frame) {
        status = frame.GetStatusBar().GetPaneText(0);
        frame.PostMessage(WM_CLOSE);
    });
    EXPECT_EQ(Run(dialog), 2);
    std::remove(file.c_str());
    EXPECT_EQ(status, "The folder cannot be read: " + file + " is a file, not a folder");
}
