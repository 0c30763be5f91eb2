#include "tree/WaitingTreeCtrl.h"

#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

CWinApp theApp("WaitingTreeTests");

void PumpPending() {
    MSG msg;
    while (::PeekMessageA(&msg, nullptr, 0, 0, PM_REMOVE)) {
        ::TranslateMessage(&msg);
        ::DispatchMessageA(&msg);
    }
}

class ParentWnd : public CWnd {
public:
    bool CreateShown() {
        return CreateEx(0, nullptr, "waiting tree", WS_POPUP | WS_VISIBLE, CRect(20, 20, 420, 420), nullptr, 0);
    }
};

using AnimatedTree = CHourglassFX<CProgressFX<CWaitingTreeCtrl>>;

// Adds its children slowly, with an unknown total, and can stop half way to look at the control.
class SlowTree : public AnimatedTree {
public:
    SlowTree() : m_drawn(::CreateEventA(nullptr, FALSE, FALSE, nullptr)) {}
    ~SlowTree() override { ::CloseHandle(m_drawn); }

    int childrenToAdd = 20;
    DWORD pauseMs = 0;
    bool refresh = false;
    bool throwHalfWay = false;
    bool captureHalfWay = false;
    int populations = 0;
    std::string loadingText;
    HTREEITEM loadingParent = nullptr;
    bool capturedAfterDrawing = false;
    int redPixels = 0, blackPixels = 0, barWidth = 0;
    std::atomic<int> ticks{0};

protected:
    void PreAnimation(HTREEITEM loading) override {
        loadingText = GetItemText(loading);
        loadingParent = GetParentItem(loading);
        AnimatedTree::PreAnimation(loading);
    }
    void DoAnimation(bool tick, int total, int count) override {
        AnimatedTree::DoAnimation(tick, total, count);
        if (tick)
            ++ticks;
        else if (total < 1 && count >= childrenToAdd / 2)
            ::SetEvent(m_drawn);
    }
    bool WantsRefresh() override { return refresh; }
    bool PopulateItem(HTREEITEM node) override {
        ++populations;
        SetPopulationCount(0, 0);
        for (int i = 0; i < childrenToAdd; ++i) {
            InsertItem("child " + std::to_string(i), 0, 0, node);
            IncreasePopulation();
            if (pauseMs)
                ::Sleep(pauseMs);
            if (i + 1 == childrenToAdd / 2) {
                if (captureHalfWay)
                    Capture();
                if (throwHalfWay)
                    throw std::runtime_error("the folder went away");
            }
        }
        SetPopulationCount(1, 1);
        return true;
    }

private:
    // Looks at the progress bar's place once the animation thread drew the half-way report.
    void Capture() {
        capturedAfterDrawing = ::WaitForSingleObject(m_drawn, 20000) == WAIT_OBJECT_0;
        HDC dc = ::GetDC(m_hWnd);
        for (int y = m_rcFrame.top; y < m_rcFrame.bottom; ++y)
            for (int x = m_rcFrame.left; x < m_rcFrame.right; ++x) {
                const COLORREF c = ::GetPixel(dc, x, y);
                redPixels += c == RGB(255, 0, 0);
                blackPixels += c == RGB(0, 0, 0);
            }
        const int y = (m_rcBar.top + m_rcBar.bottom) / 2;
        for (int x = m_rcBar.left; x < m_rcFrame.right; ++x)
            barWidth += ::GetPixel(dc, x, y) == RGB(255, 0, 0);
        ::ReleaseDC(m_hWnd, dc);
    }
    HANDLE m_drawn;
};

struct Resources {
    DWORD gdi = 0, user = 0, handles = 0;
    static Resources Now() {
        Resources r;
        r.gdi = ::GetGuiResources(::GetCurrentProcess(), GR_GDIOBJECTS);
        r.user = ::GetGuiResources(::GetCurrentProcess(), GR_USEROBJECTS);
        ::GetProcessHandleCount(::GetCurrentProcess(), &r.handles);
        return r;
    }
};

class WaitingTree : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(parent.CreateShown());
        ASSERT_TRUE(tree.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT,
                                CRect(0, 0, 400, 400), &parent, 1));
        images = ImageList_Create(16, 16, ILC_COLOR32, 1, 1);
        tree.SetImageList(images, TVSIL_NORMAL);
        tree.SetAnimationPeriod(125);
        node = tree.InsertItem("folder", 0, 0, TVI_ROOT, TVI_LAST, 0, 1);
        PumpPending();
    }
    void TearDown() override {
        tree.DestroyWindow();
        parent.DestroyWindow();
        ImageList_Destroy(images);
    }
    std::vector<std::string> Children() const {
        std::vector<std::string> names;
        for (HTREEITEM c = tree.GetChildItem(node); c; c = tree.GetNextSiblingItem(c))
            names.push_back(tree.GetItemText(c));
        return names;
    }

    ParentWnd parent;
    SlowTree tree;
    HIMAGELIST images = nullptr;
    HTREEITEM node = nullptr;
};

TEST_F(WaitingTree, ExpandingFillsTheNodeBehindALoadingItemAndDrawsTheProgress) {
    tree.pauseMs = 5;
    tree.captureHalfWay = true;
    tree.Expand(node, TVE_EXPAND);

    EXPECT_EQ(tree.populations, 1);
    EXPECT_EQ(tree.loadingText, "Loading...");
    EXPECT_EQ(tree.loadingParent, node);
    const auto names = Children();
    ASSERT_EQ(names.size(), 20u);
    EXPECT_EQ(names.front(), "child 0");
    EXPECT_EQ(names.back(), "child 19");
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), static_cast<UINT>(TVIS_EXPANDED));
    EXPECT_TRUE(tree.ItemHasChildren(node));

    // Half way (10 items, unknown total) the bar is 47 pixels of red inside a black frame.
    EXPECT_TRUE(tree.capturedAfterDrawing);
    EXPECT_GT(tree.blackPixels, 100);
    EXPECT_GT(tree.redPixels, 47 * 4);
    EXPECT_GE(tree.barWidth, 47);
    int total = -5;
    EXPECT_EQ(tree.GetPopulationCount(&total), 1);
    EXPECT_EQ(total, 1);
}

TEST_F(WaitingTree, AFilledNodeIsNotFilledAgain) {
    tree.childrenToAdd = 3;
    tree.Expand(node, TVE_EXPAND);
    ASSERT_EQ(tree.populations, 1);
    tree.Expand(node, TVE_COLLAPSE);
    tree.Expand(node, TVE_EXPAND);
    EXPECT_EQ(tree.populations, 1);
    EXPECT_EQ(Children().size(), 3u);
}

TEST_F(WaitingTree, ANodeThatStaysEmptyLosesItsButton) {
    tree.childrenToAdd = 0;
    tree.Expand(node, TVE_EXPAND);
    EXPECT_EQ(tree.populations, 1);
    EXPECT_TRUE(Children().empty());
    EXPECT_FALSE(tree.ItemHasChildren(node));
}

TEST_F(WaitingTree, RefreshingFillsTheSubtreeAgain) {
    tree.childrenToAdd = 4;
    tree.Expand(node, TVE_EXPAND);
    tree.childrenToAdd = 6;
    tree.RefreshSubtree(node);
    EXPECT_EQ(tree.populations, 2);
    EXPECT_EQ(Children().size(), 6u);
    tree.RefreshRoot();
    EXPECT_EQ(tree.populations, 3);
}

std::vector<std::string>& Reports() {
    static std::vector<std::string> reports;
    return reports;
}

TEST_F(WaitingTree, AFillingThatThrowsIsReportedAndReleasesEverything) {
    tree.childrenToAdd = 4;
    tree.Expand(node, TVE_EXPAND); // the timer's own thread exists once before counting
    PumpPending();
    tree.throwHalfWay = true;
    const Resources before = Resources::Now();
    for (int i = 0; i < 20; ++i)
        EXPECT_THROW(tree.RefreshSubtree(node), std::runtime_error);

    // Through the control's notification the error is reported, and the window goes on.
    Reports().clear();
    AFX_ERROR_REPORTER previous = AfxSetErrorReporter([](const char* text) { Reports().emplace_back(text); });
    HTREEITEM other = tree.InsertItem("other", 0, 0, TVI_ROOT, TVI_LAST, 0, 1);
    tree.Expand(other, TVE_EXPAND);
    AfxSetErrorReporter(previous);
    EXPECT_EQ(Reports().size(), 1u);
    tree.DeleteItem(other);
    PumpPending();

    const Resources after = Resources::Now();
    EXPECT_EQ(after.gdi, before.gdi);
    EXPECT_EQ(after.user, before.user);
    EXPECT_EQ(after.handles, before.handles);
    tree.throwHalfWay = false;
    tree.RefreshSubtree(node);
    EXPECT_EQ(Children().size(), 4u);
}

TEST_F(WaitingTree, AThousandFillingsLeaveNoHandleNorGdiObjectBehind) {
    tree.childrenToAdd = 5;
    tree.Expand(node, TVE_EXPAND);
    tree.RefreshSubtree(node);
    PumpPending();
    const Resources before = Resources::Now();
    for (int i = 0; i < 1000; ++i)
        tree.RefreshSubtree(node);
    PumpPending();
    const Resources after = Resources::Now();
    EXPECT_EQ(tree.populations, 1002);
    EXPECT_EQ(Children().size(), 5u);
    EXPECT_EQ(after.gdi, before.gdi);
    EXPECT_EQ(after.user, before.user);
    EXPECT_EQ(after.handles, before.handles);
}

} // namespace
