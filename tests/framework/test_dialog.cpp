#include "test_support.h"
#include "resource.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>

namespace {

std::vector<std::string> g_walk;

// A window that notes each PreTranslateMessage it is offered (for WM_KEYDOWN), optionally eating it.
template <class Base> class Walker : public Base {
public:
    std::string name;
    bool eat = false;
    int keysSeen = 0; // WM_KEYDOWN that reached the window procedure

    bool PreTranslateMessage(MSG* pMsg) override {
        if (pMsg->message == WM_KEYDOWN && pMsg->wParam == VK_F9) {
            g_walk.push_back(name);
            return eat;
        }
        return Base::PreTranslateMessage(pMsg);
    }

protected:
    void OnKeyDown(UINT nChar, UINT repeat, UINT flags) override {
        if (nChar == VK_F9)
            ++keysSeen;
        Base::OnKeyDown(nChar, repeat, flags);
    }
};

constexpr UINT WM_TEST_STEP = WM_APP + 1;
constexpr UINT_PTR kStepTimer = 99;

// The dialog under test: the test scripts each run through posted steps.
class TestDialog : public Walker<CDialog> {
public:
    TestDialog() { m_nIDTemplate = IDD_TEST_DIALOG; }
    std::function<void(TestDialog&, int)> onStep;
    Walker<CWnd> edit;
    bool throwInInit = false;
    int idleUpdates = 0;
    std::string okText;
    bool ownerEnabledDuringRun = true;

    bool OnInitDialog() override {
        CDialog::OnInitDialog();
        edit.name = "edit";
        edit.SubclassDlgItem(IDC_TEST_EDIT, this);
        PostMessage(WM_TEST_STEP, 0);
        if (throwInInit)
            throw std::runtime_error("init failed");
        return true;
    }
    void OnOK() override {
        okText = GetDlgItemText(IDC_TEST_EDIT);
        CDialog::OnOK();
    }

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override {
        if (message == WM_TEST_STEP) {
            if (HWND owner = ::GetWindow(m_hWnd, GW_OWNER))
                ownerEnabledDuringRun = ::IsWindowEnabled(owner) != FALSE;
            if (onStep)
                onStep(*this, static_cast<int>(wParam));
            return 0;
        }
        if (message == WM_TIMER && wParam == kStepTimer) {
            KillTimer(kStepTimer);
            if (onStep)
                onStep(*this, 100);
            return 0;
        }
        return Walker<CDialog>::WindowProc(message, wParam, lParam);
    }
};

// A top-level framework window that counts the idle updates it gets.
class IdleCounter : public Walker<CWnd> {
public:
    int idleUpdates = 0;

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override {
        if (message == WM_IDLEUPDATECMDUI) {
            ++idleUpdates;
            return 0;
        }
        return Walker<CWnd>::WindowProc(message, wParam, lParam);
    }
};

struct MainWindowScope {
    explicit MainWindowScope(CWnd* w) { AfxGetApp()->m_pMainWnd = w; }
    ~MainWindowScope() { AfxGetApp()->m_pMainWnd = nullptr; }
};

} // namespace

TEST(Dialog, EndDialogEndsTheModalRunWithItsResult) {
    TestDialog dlg;
    dlg.onStep = [](TestDialog& d, int) { d.EndDialog(42); };
    EXPECT_EQ(dlg.DoModal(), 42);
    EXPECT_EQ(dlg.m_hWnd, nullptr);
    EXPECT_FALSE(dlg.IsModalRunning());
}

TEST(Dialog, OkButtonReadsControlsAndEndsWithIdOk) {
    TestDialog dlg;
    dlg.onStep = [](TestDialog& d, int) {
        d.SetDlgItemText(IDC_TEST_EDIT, "typed");
        d.PostMessage(WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED), reinterpret_cast<LPARAM>(d.GetDlgItem(IDOK)));
    };
    EXPECT_EQ(dlg.DoModal(), IDOK);
    EXPECT_EQ(dlg.okText, "typed");
}

TEST(Dialog, EscapeCancels) {
    TestDialog dlg;
    dlg.onStep = [](TestDialog& d, int) {
        ::SetFocus(d.edit.m_hWnd);
        d.edit.PostMessage(WM_KEYDOWN, VK_ESCAPE, 0);
    };
    EXPECT_EQ(dlg.DoModal(), IDCANCEL);
}

TEST(Dialog, OwnerIsDisabledDuringTheRunAndEnabledAfter) {
    IdleCounter owner;
    ASSERT_TRUE(owner.CreateEx(0, nullptr, "owner", WS_OVERLAPPEDWINDOW, SomeRect(), nullptr, 0));
    MainWindowScope scope(&owner);
    TestDialog dlg;
    dlg.onStep = [](TestDialog& d, int) { d.EndDialog(1); };
    EXPECT_EQ(dlg.DoModal(), 1);
    EXPECT_FALSE(dlg.ownerEnabledDuringRun);
    EXPECT_TRUE(owner.IsWindowEnabled());
}

TEST(Dialog, PreTranslateWalksFromTheWindowUpThroughItsParentsThenTheMainWindow) {
    Walker<CWnd> main;
    main.name = "main";
    ASSERT_TRUE(main.CreateEx(0, nullptr, "main", WS_POPUP, SomeRect(), nullptr, 0));
    MainWindowScope scope(&main);
    g_walk.clear();
    TestDialog dlg;
    dlg.name = "dialog";
    dlg.onStep = [](TestDialog& d, int step) {
        if (step == 0) {
            d.edit.PostMessage(WM_KEYDOWN, VK_F9, 0);
            d.PostMessage(WM_TEST_STEP, 1);
        } else {
            d.EndDialog(5);
        }
    };
    EXPECT_EQ(dlg.DoModal(), 5);
    std::vector<std::string> expected{"edit", "dialog", "main"};
    EXPECT_EQ(g_walk, expected);
    EXPECT_EQ(dlg.edit.keysSeen, 1); // nobody ate it: dispatched
}

TEST(Dialog, WindowsOutsideTheDialogArePreTranslatedInItsLoop) {
    // An owned top-level frame with a child, as the explorer's frame under its run dialog.
    g_walk.clear();
    TestDialog dlg;
    dlg.name = "dialog";
    Walker<CWnd> frame, child;
    frame.name = "frame";
    child.name = "child";
    dlg.onStep = [&](TestDialog& d, int step) {
        switch (step) {
        case 0:
            AfxGetApp()->m_pMainWnd = &d; // the dialog is the application's main window
            frame.CreateEx(0, nullptr, "frame", WS_OVERLAPPEDWINDOW, SomeRect(), &d, 0);
            child.CreateEx(0, nullptr, "", WS_CHILD | WS_VISIBLE, CRect(0, 0, 50, 50), &frame, 1);
            child.PostMessage(WM_KEYDOWN, VK_F9, 0);
            d.PostMessage(WM_TEST_STEP, 1);
            break;
        case 1:
            frame.eat = true; // an accelerator of the frame: consumed, never dispatched
            child.PostMessage(WM_KEYDOWN, VK_F9, 0);
            d.PostMessage(WM_TEST_STEP, 2);
            break;
        default:
            frame.DestroyWindow();
            d.EndDialog(3);
        }
    };
    EXPECT_EQ(dlg.DoModal(), 3);
    AfxGetApp()->m_pMainWnd = nullptr;
    std::vector<std::string> expected{"child", "frame", "dialog", "child", "frame"};
    EXPECT_EQ(g_walk, expected);
    EXPECT_EQ(child.keysSeen, 1);
}

TEST(Dialog, TheFirstWindowThatTakesTheMessageEndsTheWalk) {
    g_walk.clear();
    TestDialog dlg;
    dlg.name = "dialog";
    dlg.edit.eat = true;
    dlg.onStep = [](TestDialog& d, int step) {
        if (step == 0) {
            d.edit.eat = true;
            d.edit.PostMessage(WM_KEYDOWN, VK_F9, 0);
            d.PostMessage(WM_TEST_STEP, 1);
        } else {
            d.EndDialog(0);
        }
    };
    EXPECT_EQ(dlg.DoModal(), 0);
    EXPECT_EQ(g_walk, std::vector<std::string>{"edit"});
    EXPECT_EQ(dlg.edit.keysSeen, 0);
}

TEST(Dialog, ExceptionInOnInitDialogIsReportedAndEndsTheModalRun) {
    ReportCapture capture;
    ReportCapture::Reports().clear();
    IdleCounter owner;
    ASSERT_TRUE(owner.CreateEx(0, nullptr, "owner", WS_OVERLAPPEDWINDOW, SomeRect(), nullptr, 0));
    MainWindowScope scope(&owner);
    TestDialog dlg;
    dlg.throwInInit = true;
    int steps = 0;
    dlg.onStep = [&steps](TestDialog& d, int) {
        ++steps;
        d.EndDialog(9);
    };
    // A half-initialised dialog is not left waiting for input that nothing asks for.
    EXPECT_EQ(dlg.DoModal(), -1);
    EXPECT_EQ(steps, 0);
    EXPECT_EQ(ReportCapture::Reports(), std::vector<std::string>{"init failed"});
    EXPECT_TRUE(owner.IsWindowEnabled());
}

TEST(Dialog, AnOwnerDisabledWhileTheDialogInitialisesIsEnabledAfterTheRun) {
    IdleCounter owner;
    ASSERT_TRUE(owner.CreateEx(0, nullptr, "owner", WS_OVERLAPPEDWINDOW, SomeRect(), nullptr, 0));
    MainWindowScope scope(&owner);
    // What the explorer does in its run dialog's initialisation: it disables the host's frame itself.
    struct DisablesOwnerInInit : TestDialog {
        HWND ownerToDisable = nullptr;
        bool OnInitDialog() override {
            ::EnableWindow(ownerToDisable, FALSE);
            return TestDialog::OnInitDialog();
        }
    } dlg;
    dlg.ownerToDisable = owner.m_hWnd;
    dlg.onStep = [](TestDialog& d, int) { d.EndDialog(1); };
    EXPECT_EQ(dlg.DoModal(), 1);
    EXPECT_TRUE(owner.IsWindowEnabled());
}

TEST(Dialog, AnOwnerDisabledBeforeTheRunStaysDisabled) {
    IdleCounter owner;
    ASSERT_TRUE(owner.CreateEx(0, nullptr, "owner", WS_OVERLAPPEDWINDOW, SomeRect(), nullptr, 0));
    MainWindowScope scope(&owner);
    owner.EnableWindow(false);
    TestDialog dlg;
    dlg.onStep = [](TestDialog& d, int) { d.EndDialog(1); };
    EXPECT_EQ(dlg.DoModal(), 1);
    EXPECT_FALSE(owner.IsWindowEnabled());
}

TEST(Dialog, IdleUpdatesReachTheFrameworksVisibleTopLevelWindows) {
    IdleCounter frame;
    ASSERT_TRUE(frame.CreateEx(0, nullptr, "frame", WS_POPUP | WS_VISIBLE, SomeRect(), nullptr, 0));
    TestDialog dlg;
    dlg.onStep = [&](TestDialog& d, int step) {
        if (step == 0)
            d.SetTimer(kStepTimer, 100); // the queue empties meanwhile
        else
            d.EndDialog(0);
    };
    dlg.DoModal();
    EXPECT_GE(frame.idleUpdates, 1);
}

TEST(Dialog, ModelessDialogsAreCreatedAndBound) {
    TestDialog dlg;
    ASSERT_TRUE(dlg.Create(IDD_TEST_DIALOG));
    EXPECT_EQ(CWnd::FromHandle(dlg.m_hWnd), &dlg);
    EXPECT_EQ(CWnd::FromHandle(dlg.GetDlgItem(IDC_TEST_EDIT)), &dlg.edit);
    dlg.DestroyWindow();
    EXPECT_EQ(dlg.m_hWnd, nullptr);
    EXPECT_EQ(dlg.edit.m_hWnd, nullptr);
    testsupport::PumpMessages();
}

TEST(Dialog, ANestedRunEndsAsCancelledWhenTheRunItInterruptedIsEnded) {
    // The outer dialog's step runs an inner dialog; the inner one's step ends the outer run, as a result
    // message for the outer dialog would while the inner loop runs.
    TestDialog outer;
    INT_PTR innerResult = 0;
    bool innerSawOuterEnd = false;
    outer.onStep = [&](TestDialog& o, int step) {
        if (step != 0)
            return;
        TestDialog inner;
        inner.onStep = [&](TestDialog&, int) {
            o.EndDialog(2);
            innerSawOuterEnd = true;
        };
        innerResult = inner.DoModal();
    };
    EXPECT_EQ(outer.DoModal(), 2);
    EXPECT_TRUE(innerSawOuterEnd);
    EXPECT_EQ(innerResult, IDCANCEL);
}

TEST(Dialog, ANestedRunEndingItselfLeavesTheOuterRunGoing) {
    TestDialog outer;
    INT_PTR innerResult = 0;
    outer.onStep = [&](TestDialog& o, int step) {
        if (step == 0) {
            TestDialog inner;
            inner.onStep = [](TestDialog& i, int) { i.EndDialog(7); };
            innerResult = inner.DoModal();
            o.PostMessage(WM_TEST_STEP, 1);
        } else {
            o.EndDialog(3);
        }
    };
    EXPECT_EQ(outer.DoModal(), 3);
    EXPECT_EQ(innerResult, 7);
}
