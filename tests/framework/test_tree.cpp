// The tree control wrapper in a real window: the subclass hook, the background colour, item state, the
// posted image list and the expansion notifications as the control sends them.
#include "test_support.h"
#include "afxtree.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

class ParentWnd : public CWnd {
public:
    bool CreateTopLevel() { return CreateEx(0, nullptr, "tree parent", WS_POPUP, SomeRect(), nullptr, 0); }
};

class RecordingTree : public CTreeCtrl {
public:
    int subclassed = 0;
    bool boundWhenSubclassed = false;
    HIMAGELIST listToPost = nullptr;
    std::vector<UINT> codes; // AfxTreeNotifyCode of every reflected notification
    std::vector<UINT> expandActions;
    bool vetoExpand = false;

protected:
    void PreSubclassWindow() override {
        ++subclassed;
        boundWhenSubclassed = FromHandle(m_hWnd) == this;
        if (listToPost)
            PostImageList(listToPost, TVSIL_NORMAL);
    }
    bool OnNotifyReflect(NMHDR* hdr, LRESULT* result) override {
        const UINT code = AfxTreeNotifyCode(hdr->code);
        codes.push_back(code);
        if (code == TVN_ITEMEXPANDINGA || code == TVN_ITEMEXPANDEDA) {
            expandActions.push_back(reinterpret_cast<NMTREEVIEWA*>(hdr)->action);
            *result = code == TVN_ITEMEXPANDINGA && vetoExpand;
            return true;
        }
        return false;
    }
};

TEST(TreeCtrl, WideNotificationCodesMapToTheAnsiOnes) {
    EXPECT_EQ(AfxTreeNotifyCode(TVN_ITEMEXPANDINGW), static_cast<UINT>(TVN_ITEMEXPANDINGA));
    EXPECT_EQ(AfxTreeNotifyCode(TVN_ITEMEXPANDEDW), static_cast<UINT>(TVN_ITEMEXPANDEDA));
    EXPECT_EQ(AfxTreeNotifyCode(TVN_SELCHANGEDW), static_cast<UINT>(TVN_SELCHANGEDA));
    EXPECT_EQ(AfxTreeNotifyCode(TVN_GETDISPINFOW), static_cast<UINT>(TVN_GETDISPINFOA));
    EXPECT_EQ(AfxTreeNotifyCode(TVN_DELETEITEMW), static_cast<UINT>(TVN_DELETEITEMA));
    EXPECT_EQ(AfxTreeNotifyCode(TVN_ITEMEXPANDINGA), static_cast<UINT>(TVN_ITEMEXPANDINGA));
    EXPECT_EQ(AfxTreeNotifyCode(static_cast<UINT>(NM_CLICK)), static_cast<UINT>(NM_CLICK));
}

TEST(TreeCtrl, PreSubclassWindowRunsOnceTheControlIsBound) {
    ParentWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    RecordingTree tree;
    HIMAGELIST list = ImageList_Create(16, 16, ILC_COLOR32, 1, 1);
    ASSERT_NE(list, nullptr);
    tree.listToPost = list;
    ASSERT_TRUE(tree.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS, CRect(0, 0, 200, 150), &parent, 7));
    EXPECT_EQ(tree.subclassed, 1);
    EXPECT_TRUE(tree.boundWhenSubclassed);
    EXPECT_EQ(tree.GetImageList(TVSIL_NORMAL), nullptr); // posted, not yet there
    testsupport::PumpMessages();
    EXPECT_EQ(tree.GetImageList(TVSIL_NORMAL), list);
    tree.DestroyWindow();
    ImageList_Destroy(list);
}

TEST(TreeCtrl, BackgroundColourAndItemState) {
    ParentWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    RecordingTree tree;
    ASSERT_TRUE(tree.Create(WS_CHILD | WS_VISIBLE, CRect(0, 0, 200, 150), &parent, 7));
    EXPECT_EQ(tree.GetBkColor(), CLR_NONE);
    EXPECT_EQ(tree.GetEffectiveBkColor(), ::GetSysColor(COLOR_WINDOW));
    tree.SetBkColor(RGB(10, 20, 30));
    EXPECT_EQ(tree.GetBkColor(), RGB(10, 20, 30));
    EXPECT_EQ(tree.GetEffectiveBkColor(), RGB(10, 20, 30));

    HTREEITEM item = tree.InsertItem("item");
    ASSERT_NE(item, nullptr);
    EXPECT_EQ(tree.GetItemState(item, TVIS_BOLD), 0u);
    EXPECT_TRUE(tree.SetItemState(item, TVIS_BOLD, TVIS_BOLD));
    EXPECT_EQ(tree.GetItemState(item, TVIS_BOLD), static_cast<UINT>(TVIS_BOLD));
    EXPECT_TRUE(tree.SetItemState(item, 0, TVIS_BOLD));
    EXPECT_EQ(tree.GetItemState(item, TVIS_BOLD), 0u);
}

TEST(TreeCtrl, ExpansionNotificationsReachTheWrapperInTheFormTheControlSendsThem) {
    ParentWnd parent;
    ASSERT_TRUE(parent.CreateTopLevel());
    RecordingTree tree;
    ASSERT_TRUE(tree.Create(WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_LINESATROOT, CRect(0, 0, 200, 150),
                            &parent, 7));
    HTREEITEM node = tree.InsertItem("node");
    tree.InsertItem("child", 0, 0, node);

    tree.vetoExpand = true;
    tree.Expand(node, TVE_EXPAND);
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), 0u);
    ASSERT_EQ(tree.expandActions.size(), 1u);

    tree.vetoExpand = false;
    tree.expandActions.clear();
    tree.Expand(node, TVE_EXPAND);
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), static_cast<UINT>(TVIS_EXPANDED));
    ASSERT_EQ(tree.expandActions.size(), 2u);
    EXPECT_EQ(tree.expandActions[0] & TVE_EXPAND, static_cast<UINT>(TVE_EXPAND));
    EXPECT_EQ(tree.expandActions[1] & TVE_EXPAND, static_cast<UINT>(TVE_EXPAND));

    // A click on the button collapses the node, and the user's collapse is notified too.
    CRect row;
    ASSERT_TRUE(tree.GetItemRect(node, &row, true));
    const int y = (row.top + row.bottom) / 2;
    int x = 0;
    UINT flags = 0;
    while (x < row.left && !(tree.HitTest(CPoint(x, y), &flags) && (flags & TVHT_ONITEMBUTTON)))
        ++x;
    ASSERT_LT(x, row.left);
    tree.SendMessage(WM_LBUTTONDOWN, MK_LBUTTON, MAKELPARAM(x, y));
    tree.SendMessage(WM_LBUTTONUP, 0, MAKELPARAM(x, y));
    EXPECT_EQ(tree.GetItemState(node, TVIS_EXPANDED), 0u);
    ASSERT_EQ(tree.expandActions.size(), 4u);
    EXPECT_EQ(tree.expandActions[3] & TVE_COLLAPSE, static_cast<UINT>(TVE_COLLAPSE));
}

} // namespace
