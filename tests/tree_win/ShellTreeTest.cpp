// The shell folder tree in a real window: the walk along a label path, display attributes supplied at
// insertion or on demand, and what a selection does to the document, the drawing list and the highlight.
#include "ShellTestSupport.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "tree/ShellTreeCtrl.h"
#include "tree/StartShellPath.h"
#include "tests/support/MessagePump.h"
#include "tests/support/TempFolder.h"

#include <windows.h>

#include <shellapi.h>

#include <string>
#include <vector>

namespace {

CWinApp theApp("ShellTreeTests");

using testsupport::TempFolder;
using treetest::ShellTest;

constexpr DWORD kTreeStyle = WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT;

bool SameText(const std::string& a, const std::string& b) {
    return lstrcmpiA(a.c_str(), b.c_str()) == 0;
}

// The Desktop's label, the first of every label path.
std::string ShellDesktopLabel() {
    const std::string path = StartShellPathOf("C:\\");
    return path.substr(0, path.find('\\'));
}

class ParentWnd : public CWnd {
public:
    bool CreateShown() {
        return CreateEx(0, nullptr, "shell tree", WS_POPUP | WS_VISIBLE, CRect(10, 10, 610, 710), nullptr, 0);
    }
};

// Counts the attributes the control asks for on demand.
class CountingTree : public CShellTreeCtrl {
public:
    int imageRequests = 0;
    int textRequests = 0;

protected:
    bool OnNotifyReflect(NMHDR* hdr, LRESULT* result) override {
        if (AfxTreeNotifyCode(hdr->code) == TVN_GETDISPINFOA) {
            const auto* info = reinterpret_cast<const NMTVDISPINFOA*>(hdr);
            imageRequests += (info->item.mask & (TVIF_IMAGE | TVIF_SELECTEDIMAGE)) != 0;
            textRequests += (info->item.mask & TVIF_TEXT) != 0;
        }
        return CShellTreeCtrl::OnNotifyReflect(hdr, result);
    }
};

class ShellTree : public ShellTest {
protected:
    void SetUp() override {
        ShellTest::SetUp();
        ASSERT_TRUE(parent.CreateShown());
        // base\a\b (two drawings), base\a\side, base\a\b\c
        a = folder.MakeDir("a");
        b = a + "\\b";
        c = b + "\\c";
        side = a + "\\side";
        for (const std::string& dir : {b, c, side})
            ASSERT_TRUE(CreateDirectoryA(dir.c_str(), nullptr)) << dir;
        testsupport::WriteBytes(b + "\\one.dwg", "AC1018");
        testsupport::WriteBytes(b + "\\two.dwg", "AC1018");
    }
    void TearDown() override {
        parent.DestroyWindow();
        ::SetCurrentDirectoryA(originalDirectory.c_str());
        ShellTest::TearDown();
    }
    // A tree of the whole namespace from the Desktop, opened along b's label path.
    void OpenAt(CountingTree& tree, const std::string& dir, UINT callbackMask = 0, int id = 1) {
        tree.SetCallbackMask(callbackMask);
        ASSERT_TRUE(tree.Create(kTreeStyle, CRect(0, 0, 600, 700), &parent, id));
        tree.PopulateTree(nullptr, 0);
        tree.ExpandToLabelPath(StartShellPathOf(dir + "\\"));
        testsupport::PumpMessages();
    }
    // The folder model the tree shows its selections in, as the explorer's, and what it was told in order:
    // the folder shown, or "|label" for a node without a folder.
    struct Shown {
        Shown(CTessel3Doc& doc, CountingTree& tree) : folder(reader, &doc) {
            tree.SetDrawingFolder(&folder);
            folder.onShown = [this] { events.push_back(folder.Folder()); };
            tree.onNoFolderShown = [this](const std::string& label) { events.back() = "|" + label; };
        }
        FileSystemFolderReader reader;
        DrawingFolder folder;
        std::vector<std::string> events;
    };
    // What a walk told its owner: folders shown (scanned) and how the walk ended.
    struct WalkRecord {
        int shown = 0;
        std::vector<bool> ended;
    };
    static void Watch(CountingTree& tree, Shown& drawings, WalkRecord& record) {
        drawings.folder.onShown = [&record] { ++record.shown; };
        tree.onWalkEnded = [&record](bool reached) { record.ended.push_back(reached); };
    }
    // The tree as the explorer opens it: created (hidden until its walk), the Desktop in it, selections not
    // followed, then the walk to the document's start folder on the messages it is posted.
    void WalkAsTheExplorerDoes(CountingTree& tree, bool hidden) {
        ASSERT_TRUE(
            tree.Create(hidden ? kTreeStyle & ~WS_VISIBLE : kTreeStyle, CRect(0, 0, 600, 700), &parent, 1));
        tree.FollowSelection(false);
        tree.PopulateTree(nullptr, 0);
        tree.WalkToStartLater();
    }
    HTREEITEM ChildNamed(CShellTreeCtrl& tree, HTREEITEM node, const std::string& label) {
        for (HTREEITEM child = tree.GetChildItem(node); child; child = tree.GetNextSiblingItem(child))
            if (SameText(tree.GetItemText(child), label))
                return child;
        return nullptr;
    }

    std::string originalDirectory = [] {
        char dir[MAX_PATH] = "";
        ::GetCurrentDirectoryA(MAX_PATH, dir);
        return std::string(dir);
    }();
    TempFolder folder{"orvex-shelltree"};
    std::string a, b, c, side;
    ParentWnd parent;
};

TEST_F(ShellTree, TheWalkOpensTheFolderOfALabelPathWhateverItsCaseAndMakesItThePathTarget) {
    CountingTree tree;
    tree.SetCallbackMask(0);
    ASSERT_TRUE(tree.Create(kTreeStyle, CRect(0, 0, 600, 700), &parent, 1));
    tree.PopulateTree(nullptr, 0);
    ASSERT_NE(tree.GetRootItem(), nullptr);
    EXPECT_EQ(tree.GetItemText(tree.GetRootItem()), ShellDesktopLabel());

    const std::string labelPath = StartShellPathOf(b + "\\");
    std::string shouted = labelPath;
    CharUpperA(shouted.data());
    tree.ExpandToLabelPath(shouted);
    HTREEITEM target = tree.m_hPathTarget;
    ASSERT_NE(target, nullptr);
    EXPECT_TRUE(SameText(tree.FolderPathOf(target), b)) << tree.FolderPathOf(target);
    // The tree's own label path of the node is the one the call built (less its final backslash).
    EXPECT_TRUE(SameText(tree.GetLabelPath(target) + "\\", labelPath)) << tree.GetLabelPath(target);
    EXPECT_TRUE(tree.GetItemState(target, TVIS_EXPANDED) & TVIS_EXPANDED);
    // Selects nothing.
    EXPECT_EQ(tree.GetSelectedItem(), nullptr);

    // A missing middle folder: the folders before it are opened, the path target stays.
    tree.ExpandToLabelPath(StartShellPathOf(a + "\\missing\\c\\"));
    EXPECT_EQ(tree.m_hPathTarget, target);
    HTREEITEM aNode = tree.GetParentItem(target);
    ASSERT_NE(aNode, nullptr);
    EXPECT_TRUE(SameText(tree.FolderPathOf(aNode), a));
    EXPECT_NE(ChildNamed(tree, aNode, "side"), nullptr);
    EXPECT_EQ(ChildNamed(tree, aNode, "missing"), nullptr);
}

TEST_F(ShellTree, TheWalkCanLeaveItsTargetClosedForItToBeOpenedOnceQueuedMessagesAreDone) {
    CountingTree tree;
    ASSERT_TRUE(tree.Create(kTreeStyle, CRect(0, 0, 600, 700), &parent, 1));
    tree.PopulateTree(nullptr, 0);
    tree.ExpandToLabelPath(StartShellPathOf(a + "\\"), false);
    HTREEITEM target = tree.m_hPathTarget;
    ASSERT_NE(target, nullptr);
    EXPECT_TRUE(SameText(tree.FolderPathOf(target), a));
    EXPECT_FALSE(tree.GetItemState(target, TVIS_EXPANDED) & TVIS_EXPANDED);
    EXPECT_EQ(tree.GetChildItem(target), nullptr) << "not filled yet";
    EXPECT_TRUE(tree.GetItemState(tree.GetParentItem(target), TVIS_EXPANDED) & TVIS_EXPANDED);

    tree.OpenPathTargetLater();
    EXPECT_FALSE(tree.GetItemState(target, TVIS_EXPANDED) & TVIS_EXPANDED) << "opened only from the queue";
    testsupport::PumpMessages();
    EXPECT_TRUE(tree.GetItemState(target, TVIS_EXPANDED) & TVIS_EXPANDED);
    EXPECT_NE(ChildNamed(tree, target, "b"), nullptr);
    EXPECT_NE(ChildNamed(tree, target, "side"), nullptr);

    // A target deleted before the queued message comes is left alone.
    CountingTree other;
    ASSERT_TRUE(other.Create(kTreeStyle, CRect(0, 0, 600, 700), &parent, 2));
    other.PopulateTree(nullptr, 0);
    other.ExpandToLabelPath(StartShellPathOf(b + "\\"), false);
    ASSERT_NE(other.m_hPathTarget, nullptr);
    other.OpenPathTargetLater();
    other.DeleteItem(other.GetParentItem(other.m_hPathTarget));
    testsupport::PumpMessages();
    EXPECT_TRUE(other.GetCount() > 0);
}

TEST_F(ShellTree, SubFoldersComeSortedAndAnEmptyOneLosesItsButtonWhenOpened) {
    CountingTree tree;
    OpenAt(tree, a);
    HTREEITEM aNode = tree.m_hPathTarget;
    ASSERT_NE(aNode, nullptr);
    std::vector<std::string> labels;
    for (HTREEITEM child = tree.GetChildItem(aNode); child; child = tree.GetNextSiblingItem(child))
        labels.push_back(tree.GetItemText(child));
    EXPECT_EQ(labels, (std::vector<std::string>{"b", "side"}));
    TVITEMA item{};
    item.mask = TVIF_CHILDREN;
    item.hItem = ChildNamed(tree, aNode, "b");
    ASSERT_TRUE(tree.GetItem(&item));
    EXPECT_EQ(item.cChildren, 1); // c
    // An empty folder on a fixed drive loses its button once it was opened (the shell may announce
    // sub-folders for a folder without any, as Wine's does).
    HTREEITEM sideNode = ChildNamed(tree, aNode, "side");
    ASSERT_NE(sideNode, nullptr);
    tree.Expand(sideNode, TVE_EXPAND);
    item.hItem = sideNode;
    ASSERT_TRUE(tree.GetItem(&item));
    EXPECT_EQ(item.cChildren, 0);
    EXPECT_EQ(tree.GetChildItem(sideNode), nullptr);
}

TEST_F(ShellTree, AttributesSuppliedOnDemandEqualThoseComputedAtInsertion) {
    CountingTree atInsertion, onDemand;
    OpenAt(atInsertion, a, 0, 1);
    OpenAt(onDemand, a, 0x63, 2);
    ASSERT_NE(atInsertion.m_hPathTarget, nullptr);
    ASSERT_NE(onDemand.m_hPathTarget, nullptr);
    EXPECT_EQ(onDemand.GetCallbackMask(), 0x63u);
    EXPECT_EQ(atInsertion.textRequests + atInsertion.imageRequests, 0);

    HTREEITEM x = atInsertion.GetChildItem(atInsertion.m_hPathTarget);
    HTREEITEM y = onDemand.GetChildItem(onDemand.m_hPathTarget);
    int compared = 0;
    for (; x && y; x = atInsertion.GetNextSiblingItem(x), y = onDemand.GetNextSiblingItem(y), ++compared) {
        char textX[MAX_PATH] = "", textY[MAX_PATH] = "";
        TVITEMA itemX{}, itemY{};
        itemX.mask = itemY.mask = TVIF_TEXT | TVIF_IMAGE | TVIF_SELECTEDIMAGE | TVIF_CHILDREN;
        itemX.hItem = x;
        itemY.hItem = y;
        itemX.pszText = textX;
        itemY.pszText = textY;
        itemX.cchTextMax = itemY.cchTextMax = MAX_PATH;
        ASSERT_TRUE(atInsertion.GetItem(&itemX));
        ASSERT_TRUE(onDemand.GetItem(&itemY));
        EXPECT_STREQ(textX, textY);
        EXPECT_EQ(itemX.iImage, itemY.iImage) << textX;
        EXPECT_EQ(itemX.iSelectedImage, itemY.iSelectedImage) << textX;
        EXPECT_EQ(itemX.cChildren, itemY.cChildren) << textX;
    }
    EXPECT_EQ(compared, 2);
    EXPECT_EQ(x, nullptr);
    EXPECT_EQ(y, nullptr);
    EXPECT_GT(onDemand.textRequests, 0);
}

// The icon the shell gives an item when asked about the item itself.
int ShellIconOf(const std::string& path, bool open) {
    const CShellPidl id = treetest::PidlOfPath(path);
    SHFILEINFOA info{};
    const UINT how = SHGFI_PIDL | SHGFI_SYSICONINDEX | SHGFI_SMALLICON | (open ? SHGFI_OPENICON : 0);
    if (!id || !::SHGetFileInfoA(reinterpret_cast<LPCSTR>(id.get()), 0, &info, sizeof info, how))
        return -1;
    return info.iIcon;
}

TEST_F(ShellTree, EveryFolderShowsTheIconsTheShellGivesItMarkedFoldersTheirOwn) {
    // side is a system folder that names an icon of its own: the shell may draw it with that icon (Windows
    // does the same for read-only folders; Wine keeps no read-only mark on folders); the plain folders
    // around it have the plain folder icon.
    const std::string ini = side + "\\desktop.ini";
    testsupport::WriteBytes(ini, "[.ShellClassInfo]\r\nIconResource=shell32.dll,3\r\nIconFile=shell32.dll\r\n"
                                 "IconIndex=3\r\n");
    ASSERT_TRUE(::SetFileAttributesA(side.c_str(), FILE_ATTRIBUTE_SYSTEM));
    CountingTree tree;
    OpenAt(tree, a, CShellTreeCtrl::kCallbackImage | CShellTreeCtrl::kCallbackSelectedImage);
    ASSERT_NE(tree.m_hPathTarget, nullptr);
    int compared = 0;
    for (HTREEITEM item = tree.m_hPathTarget; item; item = tree.GetParentItem(item)) {
        const std::string path = tree.FolderPathOf(item);
        if (path.empty())
            continue; // Desktop, My Computer
        TVITEMA shown{};
        shown.mask = TVIF_IMAGE | TVIF_SELECTEDIMAGE;
        shown.hItem = item;
        ASSERT_TRUE(tree.GetItem(&shown));
        EXPECT_EQ(shown.iImage, ShellIconOf(path, false)) << path;
        EXPECT_EQ(shown.iSelectedImage, ShellIconOf(path, true)) << path;
        ++compared;
    }
    for (const char* name : {"b", "side"}) {
        HTREEITEM item = ChildNamed(tree, tree.m_hPathTarget, name);
        ASSERT_NE(item, nullptr) << name;
        TVITEMA shown{};
        shown.mask = TVIF_IMAGE | TVIF_SELECTEDIMAGE;
        shown.hItem = item;
        ASSERT_TRUE(tree.GetItem(&shown));
        const std::string path = a + "\\" + name;
        EXPECT_EQ(shown.iImage, ShellIconOf(path, false)) << path;
        EXPECT_EQ(shown.iSelectedImage, ShellIconOf(path, true)) << path;
        ++compared;
    }
    EXPECT_GE(compared, 4);
    ::SetFileAttributesA(side.c_str(), FILE_ATTRIBUTE_NORMAL);
    ::DeleteFileA(ini.c_str());
}

TEST_F(ShellTree, IconsOnDemandAreAskedForOnceWhenFirstShown) {
    CountingTree tree;
    OpenAt(tree, b, CShellTreeCtrl::kCallbackImage | CShellTreeCtrl::kCallbackSelectedImage);
    tree.RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
    testsupport::PumpMessages();
    const int first = tree.imageRequests;
    EXPECT_GT(first, 0);
    tree.RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
    testsupport::PumpMessages();
    EXPECT_EQ(tree.imageRequests, first) << "the control keeps the icons it was given";
    EXPECT_EQ(tree.textRequests, 0);
}

TEST_F(ShellTree, SelectingAFolderScansItAndTheHighlightFollowsTheSelection) {
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    doc.m_strPath = "C:\\before";
    CountingTree tree;
    tree.SetDocument(&doc);
    Shown drawings(doc, tree);
    const std::vector<std::string>& shown = drawings.events;
    OpenAt(tree, b);
    HTREEITEM bNode = tree.m_hPathTarget;
    ASSERT_NE(bNode, nullptr);

    ASSERT_TRUE(tree.SelectItem(bNode));
    testsupport::PumpMessages();
    EXPECT_TRUE(SameText(doc.m_strPath, b)) << doc.m_strPath;
    EXPECT_TRUE(SameText(doc.m_strShellPath, tree.GetLabelPath(bNode)));
    EXPECT_EQ(DwgList.GetSize(), 2);
    char current[MAX_PATH] = "";
    ::GetCurrentDirectoryA(MAX_PATH, current);
    EXPECT_TRUE(SameText(current, b)) << current;
    ASSERT_EQ(shown.size(), 1u);
    EXPECT_TRUE(SameText(shown.back(), b)) << shown.back();

    // The highlight never stays on a folder that is no longer the selected one.
    HTREEITEM aNode = tree.GetParentItem(bNode);
    ASSERT_TRUE(tree.SelectItem(aNode));
    testsupport::PumpMessages();
    EXPECT_TRUE(tree.GetDropHilightItem() == aNode || tree.GetDropHilightItem() == nullptr);
    EXPECT_EQ(DwgList.GetSize(), 0);
    EXPECT_TRUE(SameText(doc.m_strPath, a));

    // The Desktop has no folder: the grid empties and the current folder stays.
    ASSERT_TRUE(tree.SelectItem(tree.GetRootItem()));
    testsupport::PumpMessages();
    EXPECT_EQ(DwgList.GetSize(), 0);
    EXPECT_TRUE(SameText(doc.m_strPath, a));
    EXPECT_EQ(doc.m_strShellPath, ShellDesktopLabel());
    ASSERT_EQ(shown.size(), 3u);
    EXPECT_EQ(shown.back(), "|" + ShellDesktopLabel());
    ::GetCurrentDirectoryA(MAX_PATH, current);
    EXPECT_TRUE(SameText(current, a)) << current;
}

TEST_F(ShellTree, ASelectionMadeWhileTheTreeDoesNotFollowScansNothing) {
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    doc.m_strPath = "C:\\before";
    CountingTree tree;
    tree.SetDocument(&doc);
    Shown drawings(doc, tree);
    OpenAt(tree, b);
    BeginScan(); // what an earlier test left in the list
    tree.FollowSelection(false);
    ASSERT_TRUE(tree.SelectItem(tree.m_hPathTarget));
    testsupport::PumpMessages();
    EXPECT_EQ(drawings.events.size(), 0u);
    EXPECT_EQ(doc.m_strPath, "C:\\before");
    EXPECT_EQ(DwgList.GetSize(), 0);

    tree.FollowSelection(true);
    ASSERT_TRUE(tree.SelectItem(tree.GetParentItem(tree.m_hPathTarget)));
    testsupport::PumpMessages();
    EXPECT_EQ(drawings.events.size(), 1u);
    EXPECT_TRUE(SameText(doc.m_strPath, a)) << doc.m_strPath;
}

TEST_F(ShellTree, RefreshingRescansTheSelectedFolder) {
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    CountingTree tree;
    tree.SetDocument(&doc);
    Shown drawings(doc, tree);
    OpenAt(tree, b);
    ASSERT_TRUE(tree.SelectItem(tree.m_hPathTarget));
    testsupport::PumpMessages();
    EXPECT_EQ(DwgList.GetSize(), 2);
    testsupport::WriteBytes(b + "\\three.dwg", "AC1018");
    tree.RefreshCurrentFolder();
    EXPECT_EQ(DwgList.GetSize(), 3);
    EXPECT_EQ(drawings.events.size(), 2u);
}

// The explorer's opening: the grid has shown the start folder by its path; the tree, hidden until then,
// walks there on a queued message and selects it without scanning it again.
TEST_F(ShellTree, TheWalkToTheStartFolderSelectsItWithoutScanningWhatTheGridShowsAlready) {
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    CountingTree tree;
    Shown drawings(doc, tree);
    std::string upper = b + "\\"; // as the caller wrote it: a trailing separator
    CharUpperA(upper.data());
    ASSERT_TRUE(drawings.folder.Show(upper));
    std::string shellPath = StartShellPathOf(b + "\\");
    CharLowerA(shellPath.data());
    doc.m_strShellPath = shellPath;
    testsupport::WriteBytes(b + "\\three.dwg", "AC1018"); // a rescan would list it
    tree.SetDocument(&doc);
    WalkRecord seen;
    Watch(tree, drawings, seen);
    WalkAsTheExplorerDoes(tree, true);
    parent.SetFocus();
    EXPECT_EQ(tree.GetSelectedItem(), nullptr) << "nothing happens before the queued messages";
    EXPECT_EQ(tree.m_hPathTarget, nullptr);
    testsupport::PumpMessages();

    HTREEITEM target = tree.m_hPathTarget;
    ASSERT_NE(target, nullptr);
    EXPECT_TRUE(SameText(tree.FolderPathOf(target), b));
    EXPECT_EQ(tree.GetSelectedItem(), target);
    EXPECT_EQ(tree.GetDropHilightItem(), target) << "highlighted while the focus is elsewhere";
    EXPECT_EQ(seen.ended, std::vector<bool>{true});
    EXPECT_EQ(seen.shown, 0) << "the grid keeps what it shows";
    EXPECT_EQ(DwgList.GetSize(), 2);
    EXPECT_EQ(doc.m_strShellPath, tree.GetLabelPath(target)) << "the label path as the tree spells it";
    EXPECT_TRUE(tree.IsWindowVisible());
    EXPECT_EQ(::GetFocus(), parent.m_hWnd) << "the focus stays where it was";
    EXPECT_NE(tree.GetImageList(TVSIL_NORMAL), nullptr) << "the shell's icons";
    EXPECT_TRUE(tree.GetItemState(target, TVIS_EXPANDED) & TVIS_EXPANDED) << "opened after the walk";
    EXPECT_NE(ChildNamed(tree, target, "c"), nullptr);

    // From then on a selection is followed.
    ASSERT_TRUE(tree.SelectItem(tree.GetParentItem(target)));
    testsupport::PumpMessages();
    EXPECT_EQ(seen.shown, 1);
    EXPECT_TRUE(SameText(doc.m_strPath, a)) << doc.m_strPath;
}

TEST_F(ShellTree, AWalkToAnotherFolderThanTheGridShowsScansTheFolderReached) {
    // Settings whose label path names another folder than their folder path: the tree's folder wins, as
    // it did when the tree was walked first.
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    CountingTree tree;
    Shown drawings(doc, tree);
    ASSERT_TRUE(drawings.folder.Show(a));
    drawings.events.clear();
    const std::vector<std::string>& shown = drawings.events;
    doc.m_strShellPath = StartShellPathOf(b + "\\");
    tree.SetDocument(&doc);
    WalkAsTheExplorerDoes(tree, false);
    testsupport::PumpMessages();
    ASSERT_NE(tree.m_hPathTarget, nullptr);
    EXPECT_EQ(tree.GetSelectedItem(), tree.m_hPathTarget);
    ASSERT_EQ(shown.size(), 1u);
    EXPECT_TRUE(SameText(shown[0], b)) << shown[0];
    EXPECT_TRUE(SameText(doc.m_strPath, b)) << doc.m_strPath;
    EXPECT_EQ(DwgList.GetSize(), 2);
}

TEST_F(ShellTree, AWalkThatDoesNotGetThereSelectsNothingAndSaysSo) {
    CTessel3Doc doc(folder.File("Orvex1.ini"));
    doc.m_strPath = b;
    std::string shellPath = StartShellPathOf(b + "\\");
    shellPath.insert(shellPath.rfind('\\'), "\\missing");
    doc.m_strShellPath = shellPath;
    CountingTree tree;
    tree.SetDocument(&doc);
    Shown drawings(doc, tree);
    WalkRecord seen;
    Watch(tree, drawings, seen);
    WalkAsTheExplorerDoes(tree, true);
    tree.SetFocus(); // as the explorer gives it: the control may select its first item on its own
    testsupport::PumpMessages();
    EXPECT_EQ(tree.m_hPathTarget, nullptr);
    EXPECT_EQ(tree.GetSelectedItem(), nullptr);
    EXPECT_EQ(seen.ended, std::vector<bool>{false});
    EXPECT_EQ(seen.shown, 0);
    EXPECT_TRUE(tree.IsWindowVisible()) << "the tree shows how far it got";
    HTREEITEM aNode = tree.GetRootItem();
    EXPECT_TRUE(tree.GetItemState(aNode, TVIS_EXPANDED) & TVIS_EXPANDED);
}

} // namespace
