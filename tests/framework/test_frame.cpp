#include "afxsplit.h"
#include "afxtree.h"
#include "resource.h"
#include "test_support.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <new>

namespace {

std::vector<std::pair<std::string, UINT>> g_commands; // (who, id)
int g_initialUpdates = 0;

class TestView : public CView {
public:
    std::string name = "view";
    bool OnCmdMsg(UINT id, int code) override {
        if (id != ID_TEST_PLAIN && id != ID_TEST_GREY)
            return false;
        g_commands.emplace_back(name, id);
        return true;
    }
    bool OnUpdateCmdUI(CCmdUI* pCmdUI) override { return UpdateTestCommand(pCmdUI); }
    void OnInitialUpdate() override {
        ++g_initialUpdates;
        CView::OnInitialUpdate();
    }
};

class TestFrame : public CFrameWnd {
public:
    CToolBar toolBar;
    CToolBar bottomBar;
    CStatusBar statusBar;
    CEdit placeholderEdit;
    bool withBars = true;
    bool withSplitter = false;
    CSplitterWnd splitter;

protected:
    int OnCreate(LPCREATESTRUCTA cs) override {
        if (CFrameWnd::OnCreate(cs) == -1)
            return -1;
        if (!withBars)
            return 0;
        if (!toolBar.CreateEx(this, TBSTYLE_FLAT,
                              WS_CHILD | WS_VISIBLE | CBRS_TOP | CBRS_GRIPPER | CBRS_TOOLTIPS | CBRS_FLYBY) ||
            !toolBar.LoadToolBar(IDR_TEST_FRAME))
            return -1;
        if (!bottomBar.CreateEx(this, TBSTYLE_FLAT, WS_CHILD | WS_VISIBLE | CBRS_BOTTOM | CBRS_TOOLTIPS,
                                CRect(), AFX_IDW_TOOLBAR + 0x10) ||
            !bottomBar.LoadToolBar(IDR_TEST_BOTTOMBAR))
            return -1;
        static const UINT indicators[] = {ID_SEPARATOR, ID_INDICATOR_CAPS, ID_INDICATOR_NUM,
                                          ID_INDICATOR_SCRL};
        if (!statusBar.Create(this) || !statusBar.SetIndicators(indicators, 4))
            return -1;
        EnableDocking(CBRS_ALIGN_ANY);
        toolBar.EnableDocking(CBRS_ALIGN_ANY);
        DockControlBar(&toolBar);
        return 0;
    }
    bool OnCreateClient(LPCREATESTRUCTA cs, CCreateContext* context) override {
        if (!withSplitter)
            return CFrameWnd::OnCreateClient(cs, context);
        return splitter.CreateStatic(this, 1, 2) &&
               splitter.CreateView<TestView>(0, 0, CSize(150, 0), context) &&
               splitter.CreateView<TestView>(0, 1, CSize(0, 0), context);
    }
    bool OnCmdMsg(UINT id, int code) override {
        if (CFrameWnd::OnCmdMsg(id, code))
            return true;
        if (id == ID_TEST_SECOND) {
            g_commands.emplace_back("frame", id);
            return true;
        }
        return false;
    }
};

struct FrameFixture : ::testing::Test {
    TestFrame* frame = new TestFrame; // deletes itself with its window
    CDocument doc;
    CCreateContext context;

    bool Load(UINT id = IDR_TEST_FRAME) {
        context.m_pCurrentDoc = &doc;
        if (!frame->withSplitter)
            context.m_pNewView = [] { return static_cast<CView*>(new TestView); };
        if (!frame->LoadFrame(id, WS_OVERLAPPEDWINDOW | FWS_ADDTOTITLE, nullptr, &context))
            return false;
        frame->MoveWindow(50, 50, 600, 400);
        return true;
    }
    void TearDown() override {
        if (::IsWindow(hwnd()))
            ::DestroyWindow(hwnd());
        g_commands.clear();
        testsupport::PumpMessages();
    }
    HWND hwnd() const { return frameHwnd ? frameHwnd : frame->m_hWnd; }
    HWND frameHwnd = nullptr;
    CRect ChildRect(HWND child) const {
        CRect rc;
        ::GetWindowRect(child, &rc);
        ::MapWindowPoints(nullptr, frame->m_hWnd, reinterpret_cast<POINT*>(&rc), 2);
        return rc;
    }
};

void SetToggled(int vk, bool on) {
    BYTE keys[256];
    ::GetKeyboardState(keys);
    keys[vk] = on ? 1 : 0;
    ::SetKeyboardState(keys);
}

} // namespace

TEST_F(FrameFixture, LoadFrameTakesMenuAcceleratorsAndTitleFromTheResourceId) {
    ASSERT_TRUE(Load());
    EXPECT_NE(frame->GetMenu(), nullptr);
    EXPECT_NE(frame->m_hAccelTable, nullptr);
    EXPECT_EQ(frame->GetWindowText(), "Test frame");
    frame->InitialUpdateFrame(&doc, true);
    EXPECT_EQ(frame->GetWindowText(), "Untitled - Test frame");
    doc.SetTitle("Drawings");
    frame->OnUpdateFrameTitle(true);
    EXPECT_EQ(frame->GetWindowText(), "Drawings - Test frame");
}

TEST_F(FrameFixture, WithoutATitleStringTheFrameIsUntitled) {
    frame->withBars = false;
    ASSERT_TRUE(frame->LoadFrame(IDR_TEST_UNTITLED, WS_OVERLAPPEDWINDOW, nullptr, nullptr));
    EXPECT_EQ(frame->GetWindowText(), "Untitled");
    EXPECT_EQ(frame->GetMenu(), nullptr);
}

TEST_F(FrameFixture, InitialUpdateReachesTheViewsAndActivatesTheFirst) {
    g_initialUpdates = 0;
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    EXPECT_EQ(g_initialUpdates, 1);
    ASSERT_NE(frame->GetActiveView(), nullptr);
    EXPECT_EQ(frame->GetActiveView()->GetDocument(), &doc);
    EXPECT_EQ(frame->GetActiveDocument(), &doc);
}

TEST_F(FrameFixture, RecalcLayoutStacksTheBarsAndGivesTheViewTheRest) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CRect client = frame->GetClientRect();
    CRect top = ChildRect(frame->toolBar.m_hWnd);
    CRect bottom = ChildRect(frame->bottomBar.m_hWnd);
    CRect status = ChildRect(frame->statusBar.m_hWnd);
    CRect view = ChildRect(frame->GetActiveView()->m_hWnd);
    EXPECT_EQ(top.top, 0);
    EXPECT_GT(top.Height(), 15);
    EXPECT_EQ(status.bottom, client.bottom);
    EXPECT_EQ(bottom.bottom, status.top); // the bottom toolbar sits above the status bar
    EXPECT_EQ(view.top, top.bottom);
    EXPECT_EQ(view.bottom, bottom.top);
    EXPECT_EQ(view.Width(), client.Width());
}

TEST_F(FrameFixture, AcceleratorsAreTranslatedByTheFrameAndRoutedToTheActiveView) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    MSG msg{frame->GetActiveView()->m_hWnd, WM_KEYDOWN, VK_F7, 0, 0, {0, 0}};
    EXPECT_TRUE(AfxPreTranslateMessage(&msg));
    ASSERT_EQ(g_commands.size(), 1u);
    EXPECT_EQ(g_commands[0], std::make_pair(std::string("view"), static_cast<UINT>(ID_TEST_PLAIN)));
    MSG other{frame->GetActiveView()->m_hWnd, WM_KEYDOWN, VK_F8, 0, 0, {0, 0}};
    EXPECT_FALSE(AfxPreTranslateMessage(&other));
}

TEST_F(FrameFixture, ToolbarButtonClicksReachTheFrame) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CRect rc;
    frame->bottomBar.GetItemRect(frame->bottomBar.CommandToIndex(ID_TEST_SECOND), &rc);
    CPoint center = rc.CenterPoint();
    frame->bottomBar.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(center.x, center.y));
    frame->bottomBar.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(center.x, center.y));
    testsupport::PumpMessages();
    ASSERT_EQ(g_commands.size(), 1u);
    EXPECT_EQ(g_commands[0], std::make_pair(std::string("frame"), static_cast<UINT>(ID_TEST_SECOND)));
}

TEST_F(FrameFixture, UpdateHandlersGreyAndCheckMenuItemsAndToolbarButtons) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    HMENU popup = ::GetSubMenu(frame->GetMenu(), 0);
    frame->SendMessage(WM_INITMENUPOPUP, reinterpret_cast<WPARAM>(popup), 0);
    EXPECT_TRUE(::GetMenuState(popup, ID_TEST_GREY, MF_BYCOMMAND) & MF_GRAYED);
    EXPECT_TRUE(::GetMenuState(popup, ID_TEST_CHECK, MF_BYCOMMAND) & MF_CHECKED);
    EXPECT_TRUE(::GetMenuState(popup, ID_VIEW_TOOLBAR, MF_BYCOMMAND) & MF_CHECKED);
    EXPECT_FALSE(::GetMenuState(popup, ID_TEST_PLAIN, MF_BYCOMMAND) & MF_GRAYED);

    CToolBarCtrl& bar = frame->toolBar.GetToolBarCtrl();
    EXPECT_TRUE(bar.IsButtonEnabled(ID_TEST_GREY));
    frame->SendMessage(WM_IDLEUPDATECMDUI, TRUE);
    EXPECT_FALSE(bar.IsButtonEnabled(ID_TEST_GREY));
    EXPECT_TRUE(bar.IsButtonChecked(ID_TEST_CHECK));
    EXPECT_TRUE(bar.IsButtonEnabled(ID_TEST_PLAIN));
    // A button the explorer disables itself stays so: no handler claims it.
    bar.EnableButton(ID_TEST_PLAIN, false);
    frame->SendMessage(WM_IDLEUPDATECMDUI, TRUE);
    EXPECT_FALSE(bar.IsButtonEnabled(ID_TEST_PLAIN));
}

TEST_F(FrameFixture, StandardCommandsShowAndHideBarsAndCloseTheFrame) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CRect viewBefore = ChildRect(frame->GetActiveView()->m_hWnd);
    frame->SendMessage(WM_COMMAND, ID_VIEW_TOOLBAR);
    EXPECT_FALSE(frame->toolBar.IsWindowVisible());
    EXPECT_EQ(ChildRect(frame->GetActiveView()->m_hWnd).top, 0);
    HMENU popup = ::GetSubMenu(frame->GetMenu(), 0);
    frame->SendMessage(WM_INITMENUPOPUP, reinterpret_cast<WPARAM>(popup), 0);
    EXPECT_FALSE(::GetMenuState(popup, ID_VIEW_TOOLBAR, MF_BYCOMMAND) & MF_CHECKED);
    frame->SendMessage(WM_COMMAND, ID_VIEW_TOOLBAR);
    EXPECT_TRUE(frame->toolBar.IsWindowVisible());
    EXPECT_EQ(ChildRect(frame->GetActiveView()->m_hWnd), viewBefore);
    frame->SendMessage(WM_COMMAND, ID_VIEW_STATUS_BAR);
    EXPECT_FALSE(frame->statusBar.IsWindowVisible());

    frameHwnd = frame->m_hWnd;
    frame->SendMessage(WM_COMMAND, ID_APP_EXIT);
    testsupport::PumpMessages();
    EXPECT_FALSE(::IsWindow(frameHwnd)); // closed, and the frame object deleted itself
}

TEST_F(FrameFixture, PlaceholderButtonBecomesASeparatorHostingAChildEdit) {
    ASSERT_TRUE(Load());
    CToolBar& bar = frame->toolBar;
    int index = bar.CommandToIndex(ID_TEST_PLACEHOLDER);
    ASSERT_EQ(index, 3);
    int countBefore = bar.GetToolBarCtrl().GetButtonCount();
    bar.SetButtonInfo(index, ID_TEST_PLACEHOLDER, TBBS_SEPARATOR, 125);
    EXPECT_EQ(bar.GetToolBarCtrl().GetButtonCount(), countBefore);
    EXPECT_EQ(bar.GetItemID(index), static_cast<UINT>(ID_TEST_PLACEHOLDER));
    EXPECT_TRUE(bar.GetButtonStyle(index) & TBBS_SEPARATOR);
    CRect rc;
    bar.GetItemRect(index, &rc);
    EXPECT_EQ(rc.Width(), 125);
    ASSERT_TRUE(frame->placeholderEdit.Create(WS_CHILD | WS_VISIBLE | ES_AUTOHSCROLL, rc, &bar, 1));
    CRect edit = frame->placeholderEdit.GetWindowRect();
    bar.ScreenToClient(&edit);
    EXPECT_EQ(edit, rc);
    // The buttons after it moved right to make room.
    CRect next;
    bar.GetItemRect(index + 1, &next);
    EXPECT_GE(next.left, rc.right);
}

TEST_F(FrameFixture, TooltipsComeFromTheStringAfterTheNewline) {
    ASSERT_TRUE(Load());
    NMTTDISPINFOA info{};
    info.hdr.hwndFrom = nullptr;
    info.hdr.idFrom = ID_TEST_PLAIN;
    info.hdr.code = TTN_GETDISPINFOA;
    frame->SendMessage(WM_NOTIFY, 0, reinterpret_cast<LPARAM>(&info));
    EXPECT_STREQ(info.lpszText, "Plain tip");
    NMTTDISPINFOW wide{};
    wide.hdr.idFrom = ID_TEST_GREY;
    wide.hdr.code = TTN_GETDISPINFOW;
    frame->SendMessage(WM_NOTIFY, 0, reinterpret_cast<LPARAM>(&wide));
    EXPECT_STREQ(wide.lpszText, L"Grey tip");
}

TEST_F(FrameFixture, FlyByPromptsShowInTheStatusBarAndReadyComesBack) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    HMENU popup = ::GetSubMenu(frame->GetMenu(), 0);
    frame->SendMessage(WM_MENUSELECT, MAKEWPARAM(ID_TEST_PLAIN, MF_HILITE), reinterpret_cast<LPARAM>(popup));
    EXPECT_EQ(frame->statusBar.GetPaneText(0), "Plain prompt");
    frame->SendMessage(WM_MENUSELECT, MAKEWPARAM(0, 0xFFFF), 0);
    EXPECT_EQ(frame->statusBar.GetPaneText(0), "Ready");

    NMTBHOTITEM hot{};
    hot.hdr = NMHDR{frame->toolBar.m_hWnd, AFX_IDW_TOOLBAR, static_cast<UINT>(TBN_HOTITEMCHANGE)};
    hot.idNew = ID_TEST_GREY;
    hot.dwFlags = HICF_MOUSE;
    frame->SendMessage(WM_NOTIFY, AFX_IDW_TOOLBAR, reinterpret_cast<LPARAM>(&hot));
    EXPECT_EQ(frame->statusBar.GetPaneText(0), "Grey it");
    hot.idOld = ID_TEST_GREY;
    hot.idNew = 0;
    hot.dwFlags = HICF_MOUSE | HICF_LEAVING;
    frame->SendMessage(WM_NOTIFY, AFX_IDW_TOOLBAR, reinterpret_cast<LPARAM>(&hot));
    EXPECT_EQ(frame->statusBar.GetPaneText(0), "Ready");
}

TEST_F(FrameFixture, StatusBarIndicatorsShowTheToggledKeys) {
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CStatusBar& bar = frame->statusBar;
    ASSERT_EQ(bar.GetCount(), 4);
    EXPECT_EQ(bar.CommandToIndex(ID_INDICATOR_NUM), 2);
    SetToggled(VK_CAPITAL, true);
    SetToggled(VK_NUMLOCK, false);
    SetToggled(VK_SCROLL, false);
    frame->SendMessage(WM_IDLEUPDATECMDUI, TRUE);
    EXPECT_EQ(bar.GetPaneText(1), "CAP");
    EXPECT_EQ(bar.GetPaneText(2), "");
    EXPECT_EQ(bar.GetPaneText(3), "");
    SetToggled(VK_CAPITAL, false);
    SetToggled(VK_SCROLL, true);
    frame->SendMessage(WM_IDLEUPDATECMDUI, TRUE);
    EXPECT_EQ(bar.GetPaneText(1), "");
    EXPECT_EQ(bar.GetPaneText(3), "SCRL");
    SetToggled(VK_SCROLL, false);
    // The message pane stretches, the indicators keep the room their text needs.
    CRect first, caps;
    bar.GetItemRect(0, &first);
    bar.GetItemRect(1, &caps);
    EXPECT_GT(first.Width(), caps.Width() * 3);
}

TEST_F(FrameFixture, SplitterColumnFollowsADragOfItsBar) {
    frame->withSplitter = true;
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CSplitterWnd& sp = frame->splitter;
    int cur = 0, min = 0;
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, 150);
    auto* left = dynamic_cast<TestView*>(sp.GetPane(0, 0));
    auto* right = dynamic_cast<TestView*>(sp.GetPane(0, 1));
    ASSERT_NE(left, nullptr);
    ASSERT_NE(right, nullptr);
    EXPECT_EQ(left->GetDocument(), &doc);
    EXPECT_EQ(frame->GetActiveView(), left);

    // Press on the bar, drag 60 pixels right, release.
    sp.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(152, 40));
    sp.SendMessage(WM_MOUSEMOVE, MK_LBUTTON, MAKELPARAM(182, 40));
    sp.SendMessage(WM_MOUSEMOVE, MK_LBUTTON, MAKELPARAM(212, 40));
    sp.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(212, 40));
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, 210);
    CRect rightRc = right->GetWindowRect();
    sp.ScreenToClient(&rightRc);
    EXPECT_EQ(rightRc.left, 210 + sp.m_cxSplitter);
    int rightCur = 0;
    sp.GetColumnInfo(1, rightCur, min);
    EXPECT_EQ(rightCur, sp.GetClientRect().Width() - 210 - sp.m_cxSplitter);
    // A press outside the bar does not drag.
    sp.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(100, 40));
    sp.SendMessage(WM_MOUSEMOVE, MK_LBUTTON, MAKELPARAM(50, 40));
    sp.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(50, 40));
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, 210);

    sp.SetColumnInfo(0, 90, 0);
    sp.RecalcLayout();
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, 90);
}

TEST_F(FrameFixture, TheSecondColumnKeepsItsMinimumWhateverTheFirstAsks) {
    frame->withSplitter = true;
    ASSERT_TRUE(Load());
    frame->InitialUpdateFrame(&doc, true);
    CSplitterWnd& sp = frame->splitter;
    const int avail = sp.GetClientRect().Width() - sp.m_cxSplitter;
    ASSERT_GT(avail, 400);
    int cur = 0, min = 0, second = 0;
    // A first column wider than the splitter (stored in a larger window): without a minimum the second
    // column has nothing left.
    sp.SetColumnInfo(0, 1347, 0);
    sp.RecalcLayout();
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, avail);
    sp.SetColumnInfo(1, 0, 200);
    sp.RecalcLayout();
    sp.GetColumnInfo(0, cur, min);
    sp.GetColumnInfo(1, second, min);
    EXPECT_EQ(cur, avail - 200);
    EXPECT_EQ(second, 200);
    auto* right = sp.GetPane(0, 1);
    ASSERT_NE(right, nullptr);
    EXPECT_EQ(right->GetClientRect().Width() > 0, true) << "the second pane shows";
    // The bar lies inside the splitter, where the mouse reaches it; a drag past the end stops there too.
    sp.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(cur + 2, 40));
    sp.SendMessage(WM_MOUSEMOVE, MK_LBUTTON, MAKELPARAM(avail + 50, 40));
    sp.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(avail + 50, 40));
    sp.GetColumnInfo(0, cur, min);
    EXPECT_EQ(cur, avail - 200);
    // Narrower than twice the minimum: the two share the room.
    frame->MoveWindow(0, 0, 300, 300);
    const int small = sp.GetClientRect().Width() - sp.m_cxSplitter;
    sp.GetColumnInfo(0, cur, min);
    sp.GetColumnInfo(1, second, min);
    EXPECT_EQ(second, small / 2 + small % 2);
    EXPECT_EQ(cur + second, small);
}

namespace {

class TestScrollView : public CScrollView {
public:
    std::vector<UINT> codes;
    bool OnScroll(UINT code, UINT pos, bool doScroll) override {
        codes.push_back(code);
        return CScrollView::OnScroll(code, pos, doScroll);
    }
};

} // namespace

TEST(ScrollView, PositionsFollowScrollRequestsWithinTheRange) {
    CWnd parent;
    ASSERT_TRUE(parent.CreateEx(0, nullptr, "", WS_POPUP | WS_VISIBLE, CRect(0, 0, 400, 400), nullptr, 0));
    TestScrollView view;
    view.m_bAutoDelete = false;
    ASSERT_TRUE(view.Create(nullptr, nullptr, WS_CHILD | WS_VISIBLE, CRect(0, 0, 300, 300), &parent, 1));
    view.SetScrollSizes(MM_TEXT, CSize(200, 100), CSize(50, 50), CSize(5, 5));
    EXPECT_FALSE(view.GetStyle() & WS_VSCROLL); // everything fits: no bars
    EXPECT_FALSE(view.GetStyle() & WS_HSCROLL);

    view.SetScrollSizes(MM_TEXT, CSize(1000, 3000), CSize(200, 100), CSize(20, 10));
    EXPECT_TRUE(view.GetStyle() & WS_VSCROLL);
    EXPECT_TRUE(view.GetStyle() & WS_HSCROLL);
    view.ScrollToPosition(CPoint(0, 500));
    EXPECT_EQ(view.GetScrollPosition(), CPoint(0, 500));
    view.SendMessage(WM_VSCROLL, SB_LINEDOWN);
    EXPECT_EQ(view.GetScrollPosition(), CPoint(0, 510));
    view.SendMessage(WM_VSCROLL, SB_PAGEDOWN);
    EXPECT_EQ(view.GetScrollPosition(), CPoint(0, 610));
    view.SendMessage(WM_HSCROLL, SB_LINEDOWN);
    EXPECT_EQ(view.GetScrollPosition(), CPoint(20, 610));
    std::vector<UINT> expected{MAKEWORD(0xFF, SB_LINEDOWN), MAKEWORD(0xFF, SB_PAGEDOWN),
                               MAKEWORD(SB_LINEDOWN, 0xFF)};
    EXPECT_EQ(view.codes, expected);

    view.SendMessage(WM_VSCROLL, SB_BOTTOM);
    EXPECT_EQ(view.GetScrollPosition().y, 3000 - view.GetClientRect().Height());
    view.SendMessage(WM_VSCROLL, SB_LINEDOWN);
    EXPECT_EQ(view.GetScrollPosition().y, 3000 - view.GetClientRect().Height());
    view.SendMessage(WM_VSCROLL, SB_TOP);
    EXPECT_EQ(view.GetScrollPosition().y, 0);
    view.SendMessage(WM_VSCROLL, SB_LINEUP);
    EXPECT_EQ(view.GetScrollPosition().y, 0);

    view.SendMessage(WM_MOUSEWHEEL, MAKEWPARAM(0, static_cast<WORD>(-WHEEL_DELTA * 2)), 0);
    EXPECT_EQ(view.GetScrollPosition().y, 20);
    EXPECT_EQ(view.codes.back(), static_cast<UINT>(MAKEWORD(0xFF, SB_LINEDOWN)));
    view.DestroyWindow();
}

namespace {

class TestTree : public CTreeCtrl {
public:
    int selChanged = 0;

protected:
    bool OnNotifyReflect(NMHDR* pNMHDR, LRESULT* pResult) override {
        if (pNMHDR->code == TVN_SELCHANGEDA || pNMHDR->code == TVN_SELCHANGEDW) {
            ++selChanged;
            *pResult = 0;
            return true;
        }
        return false;
    }
};

} // namespace

TEST(TreeCtrl, ItemsDataSelectionHitTestAndReflectedSelection) {
    CWnd parent;
    ASSERT_TRUE(parent.CreateEx(0, nullptr, "", WS_POPUP | WS_VISIBLE, CRect(0, 0, 300, 300), nullptr, 0));
    TestTree tree;
    ASSERT_TRUE(tree.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT,
                            CRect(0, 0, 300, 300), &parent, 7));
    HTREEITEM root = tree.InsertItem("Desktop", 0, 0, TVI_ROOT, TVI_LAST, 11, 1);
    HTREEITEM a = tree.InsertItem("A", 1, 2, root, TVI_LAST, 22);
    HTREEITEM b = tree.InsertItem("B", 1, 2, root, TVI_LAST, 33);
    EXPECT_EQ(tree.GetCount(), 3u);
    EXPECT_EQ(tree.GetItemData(b), 33);
    EXPECT_EQ(tree.GetItemText(a), "A");
    EXPECT_TRUE(tree.ItemHasChildren(root));
    EXPECT_EQ(tree.GetRootItem(), root);
    EXPECT_EQ(tree.GetChildItem(root), a);
    EXPECT_EQ(tree.GetNextSiblingItem(a), b);
    EXPECT_EQ(tree.GetParentItem(b), root);
    EXPECT_TRUE(tree.Expand(root, TVE_EXPAND));
    EXPECT_TRUE(tree.GetItemState(root, TVIS_EXPANDED) & TVIS_EXPANDED);
    EXPECT_TRUE(tree.SelectItem(b));
    EXPECT_EQ(tree.GetSelectedItem(), b);
    EXPECT_GE(tree.selChanged, 1);
    CRect rc;
    ASSERT_TRUE(tree.GetItemRect(a, &rc, true));
    UINT flags = 0;
    EXPECT_EQ(tree.HitTest(rc.CenterPoint(), &flags), a);
    EXPECT_TRUE(flags & TVHT_ONITEM);
    EXPECT_TRUE(tree.SetItemText(a, "Renamed"));
    EXPECT_EQ(tree.GetItemText(a), "Renamed");
    tree.DestroyWindow();
}

TEST(ToolTipCtrl, ToolsAreAddedWithTheirText) {
    CWnd owner;
    ASSERT_TRUE(owner.CreateEx(0, nullptr, "", WS_POPUP | WS_VISIBLE, CRect(0, 0, 100, 100), nullptr, 0));
    CToolTipCtrl tip;
    ASSERT_TRUE(tip.Create(&owner));
    EXPECT_TRUE(tip.AddTool(&owner, "name size date"));
    EXPECT_EQ(tip.GetToolCount(), 1);
    tip.SetMaxTipWidth(14);
    EXPECT_EQ(tip.SetMaxTipWidth(20), 14);
    tip.Activate(false);
    MSG msg{owner.m_hWnd, WM_MOUSEMOVE, 0, MAKELPARAM(5, 5), 0, {5, 5}};
    tip.RelayEvent(&msg);
    char text[64] = {};
    TTTOOLINFOA ti{};
    ti.cbSize = TTTOOLINFOA_V2_SIZE;
    ti.hwnd = owner.m_hWnd;
    ti.uId = reinterpret_cast<UINT_PTR>(owner.m_hWnd);
    ti.lpszText = text;
    tip.SendMessage(TTM_GETTEXTA, sizeof text, reinterpret_cast<LPARAM>(&ti));
    EXPECT_STREQ(text, "name size date");
}

namespace {

// A frame whose creation fails: its PreCreateWindow keeps the menu the frame was to get and may refuse,
// its OnCreate may fail. Made with new, it deletes itself with its window like every frame; its memory is
// a buffer of its own, filled with a canary when the object goes, so that a write into the freed object
// shows afterwards.
class FailingFrame : public CFrameWnd {
public:
    static void* operator new(std::size_t size);
    static void operator delete(void* object, std::size_t size);

    static constexpr unsigned char kCanary = 0xA5;
    static HMENU s_menu; // the menu of the last creation attempt
    static bool s_gone;  // whether the last object was deleted
    bool refuseInPreCreate = false;

protected:
    bool PreCreateWindow(CREATESTRUCTA& cs) override {
        const bool ok = CFrameWnd::PreCreateWindow(cs);
        s_menu = cs.hMenu;
        return ok && !refuseInPreCreate;
    }
    int OnCreate(LPCREATESTRUCTA) override { return -1; }
};

HMENU FailingFrame::s_menu = nullptr;
bool FailingFrame::s_gone = false;
alignas(FailingFrame) unsigned char g_failingFrameMemory[sizeof(FailingFrame)];

void* FailingFrame::operator new(std::size_t size) {
    if (size > sizeof g_failingFrameMemory)
        throw std::bad_alloc();
    s_gone = false;
    return g_failingFrameMemory;
}

void FailingFrame::operator delete(void* object, std::size_t size) {
    std::memset(object, kCanary, size);
    s_gone = true;
}

// Whether the freed frame's memory still holds nothing but the canary.
bool CanaryIntact() {
    return std::all_of(std::begin(g_failingFrameMemory), std::end(g_failingFrameMemory),
                       [](unsigned char byte) { return byte == FailingFrame::kCanary; });
}

} // namespace

// The frame's window failed in WM_CREATE and the frame deleted itself: LoadFrame writes nothing into it.
TEST(FrameCreation, AFrameThatDeletedItselfInAFailedCreationIsNotWrittenAfterwards) {
    CDocument doc;
    CCreateContext context;
    context.m_pCurrentDoc = &doc;
    auto* frame = new FailingFrame;
    EXPECT_FALSE(frame->LoadFrame(IDR_TEST_FRAME, WS_OVERLAPPEDWINDOW | FWS_ADDTOTITLE, nullptr, &context));
    ASSERT_TRUE(FailingFrame::s_gone) << "the frame deletes itself with its window";
    EXPECT_TRUE(CanaryIntact()) << "the freed frame was written after its creation failed";
    testsupport::PumpMessages();
}

// The menu LoadFrame loaded goes with a creation that failed in WM_CREATE.
TEST(FrameCreation, AFailedCreationLeavesNoMenuBehind) {
    auto* frame = new FailingFrame;
    EXPECT_FALSE(frame->LoadFrame(IDR_TEST_FRAME, WS_OVERLAPPEDWINDOW, nullptr, nullptr));
    ASSERT_NE(FailingFrame::s_menu, nullptr) << "the test frame's resource has a menu";
    EXPECT_FALSE(::IsMenu(FailingFrame::s_menu));
    testsupport::PumpMessages();
}

// The menu also goes when no window was made at all (the frame refused in PreCreateWindow).
TEST(FrameCreation, ARefusedCreationLeavesNoMenuBehind) {
    auto* frame = new FailingFrame;
    frame->refuseInPreCreate = true;
    EXPECT_FALSE(frame->LoadFrame(IDR_TEST_FRAME, WS_OVERLAPPEDWINDOW, nullptr, nullptr));
    ASSERT_FALSE(FailingFrame::s_gone) << "without a window the frame is not deleted";
    ASSERT_NE(FailingFrame::s_menu, nullptr) << "the test frame's resource has a menu";
    EXPECT_FALSE(::IsMenu(FailingFrame::s_menu));
    delete frame;
}
