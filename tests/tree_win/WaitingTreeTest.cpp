#include "tree/WaitingTreeCtrl.h"
#include "tests/support/MessagePump.h"
#include "resource.h"

#include <winternl.h>

#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

CWinApp theApp("WaitingTreeTests");

class ParentWnd : public CWnd {
public:
    bool CreateShown() {
        return CreateEx(0, nullptr, "waiting tree", WS_POPUP | WS_VISIBLE, CRect(20, 20, 420, 420), nullptr,
                        0);
    }
};

using AnimatedTree = CHourglassFX<CProgressFX<CWaitingTreeCtrl>>;

// Adds its children slowly, with an unknown total, and can stop half way to look at the control.
class SlowTree : public AnimatedTree {
public:
    SlowTree()
        : m_drawn(::CreateEventA(nullptr, FALSE, FALSE, nullptr)),
          m_ticked(::CreateEventA(nullptr, FALSE, FALSE, nullptr)) {
        SetHourglass(::LoadCursorW(AfxGetResourceHandle(), MAKEINTRESOURCEW(IDC_HOURGLASS)));
    }
    ~SlowTree() override {
        ::CloseHandle(m_drawn);
        ::CloseHandle(m_ticked);
    }
    bool HasHourglass() const { return m_hHourglass != nullptr; }

    int childrenToAdd = 20;
    DWORD pauseMs = 0;
    bool refresh = false;
    bool throwHalfWay = false;
    bool captureHalfWay = false;
    bool repaintHalfWay = false; // half way: the tree repaints, then the bar is measured
    int escapeAt = -1;           // an Escape key press is queued after this many children
    int added = 0;               // children added before the filling ended or stopped
    int barAfterRepaint = 0;
    int populations = 0;
    std::string loadingText;
    HTREEITEM loadingParent = nullptr;
    bool capturedAfterDrawing = false;
    int redPixels = 0, blackPixels = 0, barWidth = 0;
    std::atomic<int> ticks{0};
    bool hourglassDrawn = false;
    int hourglassPixels = 0;
    std::vector<HGDIOBJ> brushes; // every brush an animation made

protected:
    void PreAnimation(HTREEITEM loading) override {
        loadingText = GetItemText(loading);
        loadingParent = GetParentItem(loading);
        AnimatedTree::PreAnimation(loading);
        for (HGDIOBJ brush : {static_cast<HGDIOBJ>(m_brFrame), static_cast<HGDIOBJ>(m_brBar),
                              static_cast<HGDIOBJ>(m_brBackground)})
            brushes.push_back(brush);
    }
    void DoAnimation(bool tick, int total, int count) override {
        AnimatedTree::DoAnimation(tick, total, count);
        if (tick && ++ticks >= 2)
            ::SetEvent(m_ticked);
        else if (total < 1 && count >= childrenToAdd / 2)
            ::SetEvent(m_drawn);
    }
    bool WantsRefresh() override { return refresh; }
    bool PopulateItem(HTREEITEM node) override {
        ++populations;
        SetPopulationCount(0, 0);
        added = 0;
        for (int i = 0; i < childrenToAdd; ++i) {
            if (escapeAt >= 0 && FillCancelled())
                return true;
            InsertItem("child " + std::to_string(i), 0, 0, node);
            ++added;
            IncreasePopulation();
            if (i + 1 == escapeAt)
                PostMessage(WM_KEYDOWN, VK_ESCAPE, 1);
            if (pauseMs)
                ::Sleep(pauseMs);
            if (i + 1 == childrenToAdd / 2) {
                if (captureHalfWay)
                    Capture();
                if (repaintHalfWay)
                    RepaintAndMeasure();
                if (throwHalfWay)
                    throw std::runtime_error("the folder went away");
            }
        }
        SetPopulationCount(1, 1);
        return true;
    }

private:
    // Once the bar has grown as far as it goes, the tree's picture is painted over it (as when another
    // window moved off the tree); the bar must come back over the picture.
    void RepaintAndMeasure() {
        ::WaitForSingleObject(m_drawn, 20000);
        ::InvalidateRect(m_hWnd, nullptr, TRUE);
        FillCancelled(); // the filling's look at the queue paints what is invalid
        const int y = (m_rcBar.top + m_rcBar.bottom) / 2;
        for (int round = 0; round < 100 && barAfterRepaint < 47; ++round) {
            ::Sleep(30);
            HDC dc = ::GetDC(m_hWnd);
            barAfterRepaint = 0;
            for (int x = m_rcBar.left; x < m_rcFrame.right; ++x)
                barAfterRepaint += ::GetPixel(dc, x, y) == RGB(255, 0, 0);
            ::ReleaseDC(m_hWnd, dc);
        }
    }
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
        // The hourglass turns in the icon place on the timer's ticks: its outline is black.
        hourglassDrawn = m_bIcon && ::WaitForSingleObject(m_ticked, 20000) == WAIT_OBJECT_0;
        for (int py = m_rcIcon.top; py < m_rcIcon.bottom; ++py)
            for (int px = m_rcIcon.left; px < m_rcIcon.right; ++px)
                hourglassPixels += ::GetPixel(dc, px, py) == RGB(0, 0, 0);
        ::ReleaseDC(m_hWnd, dc);
    }
    HANDLE m_drawn;
    HANDLE m_ticked;
};

// The handles the process holds, from the system's handle list (GetProcessHandleCount may be a stub).
long ListedHandles() {
    struct Entry {
        ULONG pid;
        BYTE type;
        BYTE flags;
        USHORT handle;
        PVOID object;
        ACCESS_MASK access;
    };
    std::vector<char> buffer(1 << 20);
    ULONG length = 0;
    NTSTATUS status;
    while ((status = NtQuerySystemInformation(static_cast<SYSTEM_INFORMATION_CLASS>(16), buffer.data(),
                                              static_cast<ULONG>(buffer.size()), &length)) ==
           static_cast<NTSTATUS>(0xC0000004L)) // too small
        buffer.resize(buffer.size() * 2);
    if (status != 0)
        return -1;
    const ULONG entries = *reinterpret_cast<const ULONG*>(buffer.data());
    const auto* entry = reinterpret_cast<const Entry*>(buffer.data() + sizeof(ULONG_PTR));
    long count = 0;
    for (ULONG i = 0; i < entries; ++i)
        count += entry[i].pid == ::GetCurrentProcessId();
    return count;
}

struct Resources {
    DWORD gdi = 0, user = 0, handles = 0;
    long listed = 0;
    static Resources Now() {
        Resources r;
        r.listed = ListedHandles();
        r.gdi = ::GetGuiResources(::GetCurrentProcess(), GR_GDIOBJECTS);
        r.user = ::GetGuiResources(::GetCurrentProcess(), GR_USEROBJECTS);
        ::GetProcessHandleCount(::GetCurrentProcess(), &r.handles);
        return r;
    }
    // The same objects, and no more handles: the system's own threads may have closed one of theirs.
    bool NoMoreThan(const Resources& o) const {
        return gdi == o.gdi && user == o.user && handles <= o.handles && listed <= o.listed;
    }
    // The counts once the system's own threads (the timer's, Wine's) settled back to `before`, or the
    // last counts after a few seconds: a leak of one filling or more never settles.
    static Resources SettledTo(const Resources& before) {
        Resources now = Now();
        for (int round = 0; round < 100 && !now.NoMoreThan(before); ++round) {
            testsupport::PumpMessages();
            ::Sleep(50);
            now = Now();
        }
        return now;
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
        testsupport::PumpMessages();
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

// Clicks the node's expand button, as the user does.
void ClickButton(CTreeCtrl& tree, HTREEITEM item) {
    CRect label;
    ASSERT_TRUE(tree.GetItemRect(item, &label, true));
    const int y = (label.top + label.bottom) / 2;
    UINT flags = 0;
    int x = 0;
    while (x < label.left && !(tree.HitTest(CPoint(x, y), &flags) && (flags & TVHT_ONITEMBUTTON)))
        ++x;
    ASSERT_LT(x, label.left);
    tree.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, y));
    tree.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(x, y));
}

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
    ASSERT_TRUE(tree.HasHourglass());
    EXPECT_TRUE(tree.hourglassDrawn);
    EXPECT_GT(tree.hourglassPixels, 10);
    for (const std::string& name : Children())
        EXPECT_NE(name, "Loading...");
    int total = -5;
    EXPECT_EQ(tree.GetPopulationCount(&total), 1);
    EXPECT_EQ(total, 1);
}

TEST_F(WaitingTree, TheBarIsDrawnAgainAfterTheTreeRepaintsDuringTheFilling) {
    tree.childrenToAdd = 40; // half way the bar of an unknown total has stopped growing
    tree.repaintHalfWay = true;
    tree.Expand(node, TVE_EXPAND);
    EXPECT_GE(tree.barAfterRepaint, 47);
    EXPECT_EQ(Children().size(), 40u);
}

TEST_F(WaitingTree, EscapeStopsTheFillingAndLeavesTheNodeEmptyWithItsButton) {
    tree.childrenToAdd = 2000;
    tree.pauseMs = 2; // four seconds or more to the end
    tree.escapeAt = 10;
    tree.Expand(node, TVE_EXPAND);
    // Stopped at the next look at the queue (every 40 ms), long before the end.
    EXPECT_GE(tree.added, 10);
    EXPECT_LT(tree.added, 1000);
    EXPECT_TRUE(Children().empty());
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), 0u);
    EXPECT_TRUE(tree.ItemHasChildren(node)); // the button stays: it can be filled again
    // The key is left for whoever handles it after the filling.
    MSG msg;
    ASSERT_TRUE(::PeekMessageA(&msg, tree.m_hWnd, WM_KEYDOWN, WM_KEYDOWN, PM_REMOVE));
    EXPECT_EQ(msg.wParam, static_cast<WPARAM>(VK_ESCAPE));
    // Filled again, whole, when the user opens it again.
    tree.escapeAt = -1;
    tree.childrenToAdd = 5;
    tree.pauseMs = 0;
    ClickButton(tree, node);
    EXPECT_EQ(Children().size(), 5u);
    EXPECT_EQ(tree.populations, 2);
}

TEST_F(WaitingTree, AFilledNodeIsNotFilledAgain) {
    tree.childrenToAdd = 3;
    tree.Expand(node, TVE_EXPAND);
    ASSERT_EQ(tree.populations, 1);
    ClickButton(tree, node);
    ClickButton(tree, node);
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), static_cast<UINT>(TVIS_EXPANDED));
    EXPECT_EQ(tree.populations, 1);
    EXPECT_EQ(Children().size(), 3u);
}

TEST_F(WaitingTree, ClicksFillTheNodeAndATreeThatWantsRefreshFillsItOnEveryExpansion) {
    tree.childrenToAdd = 3;
    tree.refresh = true;
    ClickButton(tree, node);
    EXPECT_EQ(tree.populations, 1);
    EXPECT_EQ(Children().size(), 3u);
    ClickButton(tree, node); // collapsing empties it
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), 0u);
    EXPECT_TRUE(Children().empty());
    tree.childrenToAdd = 5;
    ClickButton(tree, node);
    EXPECT_EQ(tree.populations, 2);
    EXPECT_EQ(Children().size(), 5u);
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
    tree.Expand(node, TVE_EXPAND); // the timer's own thread exists before counting
    testsupport::PumpMessages();
    tree.throwHalfWay = true;
    // The first exception the process throws costs the runtime a couple of handles once: not counted.
    EXPECT_THROW(tree.RefreshSubtree(node), std::runtime_error);
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
    testsupport::PumpMessages();

    const Resources after = Resources::SettledTo(before);
    EXPECT_EQ(after.gdi, before.gdi);
    EXPECT_EQ(after.user, before.user);
    // A handle of the system's own (a Wine thread's) may have gone meanwhile; a leak only adds.
    EXPECT_LE(after.handles, before.handles);
    EXPECT_GT(before.listed, 0);
    EXPECT_LE(after.listed, before.listed);
    for (HGDIOBJ brush : tree.brushes)
        EXPECT_EQ(::GetObjectType(brush), 0u) << "a brush was left behind";
    tree.throwHalfWay = false;
    tree.RefreshSubtree(node);
    EXPECT_EQ(Children().size(), 4u);
}

TEST_F(WaitingTree, AThousandFillingsLeaveNoHandleNorGdiObjectBehind) {
    tree.childrenToAdd = 5;
    tree.Expand(node, TVE_EXPAND);
    tree.RefreshSubtree(node);
    testsupport::PumpMessages();
    const Resources before = Resources::Now();
    for (int i = 0; i < 1000; ++i)
        tree.RefreshSubtree(node);
    testsupport::PumpMessages();
    const Resources after = Resources::SettledTo(before);
    EXPECT_EQ(tree.populations, 1002);
    EXPECT_EQ(Children().size(), 5u);
    EXPECT_EQ(after.gdi, before.gdi);
    EXPECT_EQ(after.user, before.user);
    // A handle of the system's own (a Wine thread's) may have gone meanwhile; a leak only adds.
    EXPECT_LE(after.handles, before.handles);
    EXPECT_GT(before.listed, 0);
    EXPECT_LE(after.listed, before.listed);
    for (HGDIOBJ brush : tree.brushes)
        EXPECT_EQ(::GetObjectType(brush), 0u) << "a brush was left behind";
}

} // namespace
