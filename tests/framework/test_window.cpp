#include "test_support.h"
#include "resource.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <new>
#include <stdexcept>
#include <type_traits>

namespace {

class TestApp : public CWinApp {
public:
    TestApp() : CWinApp("FrameworkTests") {}
    bool InitInstance() override {
        ++initCount;
        return true;
    }
    int initCount = 0;
};

TestApp theApp;

// Records the handlers WindowProc called.
class RecordingWnd : public CWnd {
public:
    std::vector<std::string> calls;
    int lastCx = -1, lastCy = -1;
    UINT lastKey = 0;
    std::vector<std::pair<UINT, int>> commands;
    bool throwOnClick = false;
    int clicks = 0;

    bool CreateTopLevel() { return CreateEx(0, nullptr, "recording", WS_POPUP, SomeRect(), nullptr, 0); }

protected:
    int OnCreate(LPCREATESTRUCTA cs) override {
        calls.push_back("OnCreate");
        return CWnd::OnCreate(cs);
    }
    void OnSize(UINT type, int cx, int cy) override {
        calls.push_back("OnSize");
        lastCx = cx;
        lastCy = cy;
        CWnd::OnSize(type, cx, cy);
    }
    void OnKeyDown(UINT nChar, UINT repeat, UINT flags) override {
        calls.push_back("OnKeyDown");
        lastKey = nChar;
    }
    void OnTimer(UINT_PTR id) override {
        calls.push_back("OnTimer");
        KillTimer(id);
    }
    void OnDestroy() override {
        calls.push_back("OnDestroy");
        CWnd::OnDestroy();
    }
    void OnLButtonDown(UINT, CPoint pt) override {
        ++clicks;
        if (throwOnClick) {
            if (pt.x == 1)
                throw std::runtime_error("handler failed");
            if (pt.x == 2)
                throw 42;
            AfxThrowInvalidArgException();
        }
    }
    bool OnCmdMsg(UINT id, int code) override {
        commands.emplace_back(id, code);
        return true;
    }
    bool OnUpdateCmdUI(CCmdUI* pCmdUI) override { return UpdateTestCommand(pCmdUI); }
};

class ReflectingEdit : public CEdit {
public:
    int changes = 0;

protected:
    bool OnCommandReflect(UINT code) override {
        if (code != EN_CHANGE)
            return false;
        ++changes;
        return true;
    }
};

class ClickableStatic : public CStatic {
public:
    int clicks = 0;

protected:
    bool OnNotifyReflect(NMHDR* pNMHDR, LRESULT* pResult) override {
        if (pNMHDR->code != static_cast<UINT>(NM_CLICK))
            return false;
        ++clicks;
        *pResult = 77;
        return true;
    }
};

class SelfDeletingWnd : public CWnd {
public:
    explicit SelfDeletingWnd(bool* deleted) : m_deleted(deleted) {}
    ~SelfDeletingWnd() override { *m_deleted = true; }

protected:
    void PostNcDestroy() override { delete this; }

private:
    bool* m_deleted;
};

// A window that lives in storage the test owns: "deleting" it runs the destructor and then fills the
// storage with a pattern, so anything written into the object after its deletion shows.
class PoisonedWnd : public CWnd {
public:
    static constexpr unsigned char kPoison = 0xDD;
    static PoisonedWnd* MakeIn(void* storage) { return new (storage) PoisonedWnd(storage); }
    static bool PoisonIntact(const void* storage) {
        const auto* bytes = static_cast<const unsigned char*>(storage);
        return std::all_of(bytes, bytes + sizeof(PoisonedWnd), [](unsigned char b) { return b == kPoison; });
    }

protected:
    // WM_CLOSE destroys the window from inside a handler, as a frame's close box or File > Exit do.
    void OnClose() override { DestroyWindow(); }
    void PostNcDestroy() override {
        void* storage = m_storage;
        this->~PoisonedWnd();
        std::memset(storage, kPoison, sizeof(PoisonedWnd));
    }

private:
    explicit PoisonedWnd(void* storage) : m_storage(storage) {}
    void* m_storage;
};

// Handlers of creation that throw.
class ThrowsOnCreate : public CWnd {
public:
    UINT throwOn = WM_CREATE;

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override {
        if (message == throwOn)
            throw std::runtime_error("creation failed");
        return CWnd::WindowProc(message, wParam, lParam);
    }
};

// An edit whose typed characters are turned to upper case before the edit sees them.
class UpperEdit : public CWnd {
protected:
    void OnChar(UINT nChar, UINT repeat, UINT flags) override {
        if (nChar >= 'a' && nChar <= 'z') {
            SendMessage(WM_CHAR, nChar - 'a' + 'A', 0); // comes back here as a capital
            return;
        }
        CWnd::OnChar(nChar, repeat, flags);
    }
};

} // namespace

TEST(ModuleState, InstanceHandleIsTheModuleTheFrameworkIsLinkedInto) {
    EXPECT_EQ(AfxGetInstanceHandle(), ::GetModuleHandleA(nullptr));
    EXPECT_EQ(AfxGetResourceHandle(), AfxGetInstanceHandle());
}

TEST(ModuleState, TheGlobalAppIsTheModulesApplication) {
    EXPECT_EQ(AfxGetApp(), &theApp);
    EXPECT_EQ(theApp.m_hInstance, AfxGetInstanceHandle());
    EXPECT_TRUE(AfxWinInit());
    EXPECT_TRUE(AfxWinInit());
    EXPECT_EQ(theApp.initCount, 1); // once per load
    EXPECT_EQ(AfxGetMainWnd(), nullptr);
    RecordingWnd main;
    theApp.m_pMainWnd = &main;
    EXPECT_EQ(AfxGetMainWnd(), &main);
    theApp.m_pMainWnd = nullptr;
}

TEST(ModuleState, LoadsStringsOfTheModule) {
    EXPECT_EQ(CWinApp::LoadString(IDS_TEST_STRING), "Hello\nTip");
    EXPECT_EQ(CWinApp::LoadString(9999), "");
}

TEST(ModuleState, WindowClassesAreOursAndUnregisteredAtTermination) {
    {
        RecordingWnd w;
        ASSERT_TRUE(w.CreateTopLevel());
        char name[128] = {};
        ::GetClassNameA(w.m_hWnd, name, sizeof name);
        EXPECT_EQ(std::string(name).rfind("Orvex1", 0), 0u) << name;
        const char* custom = AfxRegisterWndClass(CS_DBLCLKS, ::LoadCursorA(nullptr, IDC_ARROW),
                                                 static_cast<HBRUSH>(::GetStockObject(LTGRAY_BRUSH)));
        EXPECT_EQ(std::string(custom).rfind("Orvex1", 0), 0u) << custom;
        w.DestroyWindow();
    }
    WNDCLASSEXA wc{};
    wc.cbSize = sizeof wc;
    ASSERT_TRUE(::GetClassInfoExA(AfxGetInstanceHandle(), AFX_WND_CLASS, &wc));
    AfxWinTerm();
    EXPECT_FALSE(::GetClassInfoExA(AfxGetInstanceHandle(), AFX_WND_CLASS, &wc));
    // Loaded again: the classes come back on first use.
    AfxWinInit();
    RecordingWnd again;
    EXPECT_TRUE(again.CreateTopLevel());
}

TEST(Binding, ObjectIsFoundFromItsWindowUntilTheWindowIsDestroyed) {
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    HWND hwnd = w.m_hWnd;
    EXPECT_EQ(CWnd::FromHandle(hwnd), &w);
    EXPECT_EQ(::GetWindowLongPtrA(hwnd, GWLP_USERDATA), reinterpret_cast<LONG_PTR>(&w));
    EXPECT_TRUE(w.DestroyWindow());
    EXPECT_EQ(w.m_hWnd, nullptr);
    EXPECT_FALSE(::IsWindow(hwnd));
    EXPECT_EQ(CWnd::FromHandle(hwnd), nullptr);
}

TEST(Binding, ForeignWindowsAreNotTaken) {
    HWND foreign =
        ::CreateWindowExA(0, "STATIC", "x", WS_POPUP, 0, 0, 10, 10, nullptr, nullptr, nullptr, nullptr);
    ASSERT_NE(foreign, nullptr);
    RecordingWnd someone;
    ::SetWindowLongPtrA(foreign, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(&someone)); // not bound by us
    EXPECT_EQ(CWnd::FromHandle(foreign), nullptr);
    EXPECT_EQ(CWnd::FromHandle(nullptr), nullptr);
    ::DestroyWindow(foreign);
}

TEST(Binding, DestroyingTheObjectDestroysItsWindow) {
    HWND hwnd = nullptr;
    {
        RecordingWnd w;
        ASSERT_TRUE(w.CreateTopLevel());
        hwnd = w.m_hWnd;
    }
    EXPECT_FALSE(::IsWindow(hwnd));
}

TEST(Binding, PostNcDestroyRunsAfterUnbindingAndMayDeleteTheObject) {
    bool deleted = false;
    auto* w = new SelfDeletingWnd(&deleted);
    ASSERT_TRUE(w->CreateEx(0, nullptr, "", WS_POPUP, SomeRect(), nullptr, 0));
    HWND hwnd = w->m_hWnd;
    ::DestroyWindow(hwnd);
    EXPECT_TRUE(deleted);
}

TEST(Binding, AnObjectDeletedWhileItHandlesAMessageIsNotWrittenAfterwards) {
    alignas(PoisonedWnd) static unsigned char storage[sizeof(PoisonedWnd)];
    PoisonedWnd* w = PoisonedWnd::MakeIn(storage);
    ASSERT_TRUE(w->CreateEx(0, nullptr, "", WS_POPUP, SomeRect(), nullptr, 0));
    HWND hwnd = w->m_hWnd;
    // WM_CLOSE -> DestroyWindow -> WM_NCDESTROY -> PostNcDestroy frees the object, all inside the
    // handling of WM_CLOSE; the outer handling must return without touching the freed object.
    ::SendMessageA(hwnd, WM_CLOSE, 0, 0);
    EXPECT_FALSE(::IsWindow(hwnd));
    EXPECT_TRUE(PoisonedWnd::PoisonIntact(storage));
}

TEST(Binding, AttachedWindowsAreNeitherBoundNorDestroyed) {
    HWND foreign =
        ::CreateWindowExA(0, "STATIC", "x", WS_POPUP, 0, 0, 10, 10, nullptr, nullptr, nullptr, nullptr);
    {
        CWnd view;
        view.Attach(foreign);
        EXPECT_EQ(view.GetWindowText(), "x");
        EXPECT_EQ(CWnd::FromHandle(foreign), nullptr);
    }
    EXPECT_TRUE(::IsWindow(foreign));
    ::DestroyWindow(foreign);
}

TEST(Dispatch, MessagesReachTheirNamedHandlers) {
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    EXPECT_EQ(w.calls.front(), "OnCreate");
    w.calls.clear();
    w.SendMessage(WM_SIZE, SIZE_RESTORED, MAKELPARAM(123, 45));
    EXPECT_EQ(w.lastCx, 123);
    EXPECT_EQ(w.lastCy, 45);
    w.SendMessage(WM_KEYDOWN, VK_F5, 0);
    EXPECT_EQ(w.lastKey, static_cast<UINT>(VK_F5));
    w.SetTimer(7, 1);
    for (int i = 0; i < 200 && std::find(w.calls.begin(), w.calls.end(), "OnTimer") == w.calls.end(); ++i) {
        ::Sleep(5);
        testsupport::PumpMessages();
    }
    w.DestroyWindow();
    std::vector<std::string> expected{"OnSize", "OnKeyDown", "OnTimer", "OnDestroy"};
    EXPECT_EQ(w.calls, expected);
}

TEST(Dispatch, WindowWrappersWork) {
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    w.SetWindowText("title text");
    EXPECT_EQ(w.GetWindowText(), "title text");
    w.MoveWindow(20, 30, 200, 100);
    CRect rc = w.GetWindowRect();
    EXPECT_EQ(rc, CRect(20, 30, 220, 130));
    EXPECT_EQ(w.GetClientRect().Width(), 200);
    CEdit edit;
    ASSERT_TRUE(edit.Create(WS_CHILD | WS_VISIBLE, CRect(0, 0, 50, 20), &w, 55));
    EXPECT_EQ(edit.GetParent(), &w);
    EXPECT_EQ(w.GetDlgItem(55), edit.m_hWnd);
    w.SetDlgItemText(55, "abc");
    EXPECT_EQ(w.GetDlgItemText(55), "abc");
    w.EnableWindow(false);
    EXPECT_FALSE(w.IsWindowEnabled());
    w.EnableWindow(true);
    EXPECT_TRUE(w.ModifyStyle(0, WS_BORDER));
    EXPECT_TRUE(w.GetStyle() & WS_BORDER);
}

TEST(Exceptions, ThrownInAHandlerAreReportedAndTheWindowGoesOn) {
    ReportCapture capture;
    ReportCapture::Reports().clear();
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    w.throwOnClick = true;
    EXPECT_EQ(w.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(0, 0)), 0);
    EXPECT_EQ(w.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(1, 0)), 0);
    EXPECT_EQ(w.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(2, 0)), 0);
    std::vector<std::string> expected{"Invalid argument.", "handler failed", "An unknown error occurred."};
    EXPECT_EQ(ReportCapture::Reports(), expected);
    EXPECT_EQ(w.clicks, 3);
    // Still alive and dispatching.
    EXPECT_TRUE(::IsWindow(w.m_hWnd));
    w.SendMessage(WM_SIZE, 0, MAKELPARAM(9, 8));
    EXPECT_EQ(w.lastCx, 9);
}

TEST(Exceptions, ThrownInWmCreateFailTheCreation) {
    ReportCapture capture;
    ReportCapture::Reports().clear();
    ThrowsOnCreate w;
    EXPECT_FALSE(w.CreateEx(0, nullptr, "throws", WS_POPUP, SomeRect(), nullptr, 0));
    EXPECT_EQ(w.m_hWnd, nullptr);
    EXPECT_EQ(ReportCapture::Reports(), std::vector<std::string>{"creation failed"});
}

TEST(Exceptions, ThrownInWmNcCreateFailTheCreation) {
    ReportCapture capture;
    ReportCapture::Reports().clear();
    ThrowsOnCreate w;
    w.throwOn = WM_NCCREATE;
    EXPECT_FALSE(w.CreateEx(0, nullptr, "throws", WS_POPUP, SomeRect(), nullptr, 0));
    EXPECT_EQ(w.m_hWnd, nullptr);
    EXPECT_EQ(ReportCapture::Reports(), std::vector<std::string>{"creation failed"});
}

TEST(Exceptions, OtherMessagesAnswerNotHandled) {
    EXPECT_EQ(AfxFailureResult(WM_CREATE), -1);
    EXPECT_EQ(AfxFailureResult(WM_NCCREATE), FALSE);
    EXPECT_EQ(AfxFailureResult(WM_PAINT), 0);
    EXPECT_EQ(AfxFailureResult(WM_NOTIFY), 0);
}

TEST(Exceptions, ThrownByAPostedMessageDoNotLeaveTheMessageLoop) {
    ReportCapture capture;
    ReportCapture::Reports().clear();
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    w.throwOnClick = true;
    w.PostMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(1, 0));
    testsupport::PumpMessages();
    ASSERT_EQ(ReportCapture::Reports().size(), 1u);
    EXPECT_EQ(ReportCapture::Reports()[0], "handler failed");
}

TEST(Reflection, EditChangeGoesToTheEditsWrapper) {
    RecordingWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    ReflectingEdit edit;
    ASSERT_TRUE(edit.Create(WS_CHILD | WS_VISIBLE, CRect(0, 0, 100, 20), &parent, 10));
    edit.SetWindowText("changed");
    EXPECT_EQ(edit.changes, 1);
    for (const auto& command : parent.commands) // the parent never saw the change
        EXPECT_NE(command.second, EN_CHANGE);
    // A notification the wrapper does not take goes on to the parent's command handler.
    parent.commands.clear();
    parent.SendMessage(WM_COMMAND, MAKEWPARAM(10, EN_SETFOCUS), reinterpret_cast<LPARAM>(edit.m_hWnd));
    ASSERT_EQ(parent.commands.size(), 1u);
    EXPECT_EQ(parent.commands[0], std::make_pair(10u, static_cast<int>(EN_SETFOCUS)));
}

TEST(Reflection, NotifyGoesToTheSendingControlsWrapper) {
    RecordingWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    ClickableStatic label;
    ASSERT_TRUE(label.Create("label", WS_CHILD | WS_VISIBLE, CRect(0, 0, 100, 20), &parent, 11));
    NMHDR hdr{label.m_hWnd, 11, static_cast<UINT>(NM_CLICK)};
    LRESULT result = parent.SendMessage(WM_NOTIFY, 11, reinterpret_cast<LPARAM>(&hdr));
    EXPECT_EQ(label.clicks, 1);
    EXPECT_EQ(result, 77);
    hdr.code = static_cast<UINT>(NM_DBLCLK);
    EXPECT_EQ(parent.SendMessage(WM_NOTIFY, 11, reinterpret_cast<LPARAM>(&hdr)), 0);
    EXPECT_EQ(label.clicks, 1);
}

TEST(Reflection, MenuAndAcceleratorCommandsGoToOnCmdMsg) {
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    w.SendMessage(WM_COMMAND, MAKEWPARAM(ID_TEST_PLAIN, 0), 0);
    w.SendMessage(WM_COMMAND, MAKEWPARAM(ID_TEST_GREY, 1), 0);
    ASSERT_EQ(w.commands.size(), 2u);
    EXPECT_EQ(w.commands[0], std::make_pair(static_cast<UINT>(ID_TEST_PLAIN), 0));
    EXPECT_EQ(w.commands[1], std::make_pair(static_cast<UINT>(ID_TEST_GREY), 1));
}

TEST(Subclassing, SystemControlsRouteThroughWindowProcAndDefaultReachesThem) {
    RecordingWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    HWND raw = ::CreateWindowExA(0, "EDIT", "", WS_CHILD | WS_VISIBLE, 0, 0, 100, 20, parent.m_hWnd, nullptr,
                                 nullptr, nullptr);
    LONG_PTR original = ::GetWindowLongPtrA(raw, GWLP_WNDPROC);
    UpperEdit edit;
    ASSERT_TRUE(edit.SubclassWindow(raw));
    EXPECT_EQ(CWnd::FromHandle(raw), &edit);
    EXPECT_FALSE(edit.SubclassWindow(raw)); // bound once
    edit.SendMessage(WM_CHAR, 'a', 0);
    edit.SendMessage(WM_CHAR, 'B', 0);
    EXPECT_EQ(edit.GetWindowText(), "AB");
    EXPECT_EQ(edit.UnsubclassWindow(), raw);
    EXPECT_EQ(::GetWindowLongPtrA(raw, GWLP_WNDPROC), original);
    EXPECT_EQ(CWnd::FromHandle(raw), nullptr);
    ::SendMessageA(raw, WM_CHAR, 'c', 0);
    EXPECT_EQ(edit.m_hWnd, nullptr);
    char text[16] = {};
    ::GetWindowTextA(raw, text, sizeof text);
    EXPECT_STREQ(text, "ABc");
}

TEST(UpdateHandlers, MenuItemsAreGreyedAndCheckedOnInitMenuPopup) {
    RecordingWnd w;
    ASSERT_TRUE(w.CreateTopLevel());
    CMenu menu;
    ASSERT_TRUE(menu.LoadMenu(IDR_TEST_MENU));
    CMenu popup = menu.GetSubMenu(0);
    ASSERT_NE(popup.m_hMenu, nullptr);
    EXPECT_FALSE(popup.GetMenuState(ID_TEST_GREY, MF_BYCOMMAND) & MF_GRAYED);
    w.SendMessage(WM_INITMENUPOPUP, reinterpret_cast<WPARAM>(popup.m_hMenu), 0);
    EXPECT_TRUE(popup.GetMenuState(ID_TEST_GREY, MF_BYCOMMAND) & MF_GRAYED);
    EXPECT_TRUE(popup.GetMenuState(ID_TEST_CHECK, MF_BYCOMMAND) & MF_CHECKED);
    EXPECT_EQ(popup.GetMenuState(ID_TEST_PLAIN, MF_BYCOMMAND) & (MF_GRAYED | MF_CHECKED), 0u);
}

TEST(Menu, IsMoveOnlyAndSubmenusAreNotOwned) {
    static_assert(!std::is_copy_constructible_v<CMenu>, "a copy would destroy the menu twice");
    static_assert(std::is_move_constructible_v<CMenu>, "menus can be handed on");
    CMenu menu;
    ASSERT_TRUE(menu.LoadMenu(IDR_TEST_MENU));
    HMENU sub = nullptr;
    {
        CMenu popup = menu.GetSubMenu(0);
        sub = popup.m_hMenu;
    }
    EXPECT_TRUE(::IsMenu(sub)); // still alive: the submenu belongs to its parent
    HMENU top = menu.m_hMenu;
    CMenu moved(std::move(menu));
    EXPECT_EQ(menu.m_hMenu, nullptr);
    EXPECT_EQ(moved.m_hMenu, top);
    moved.DestroyMenu();
    EXPECT_FALSE(::IsMenu(top));
}
