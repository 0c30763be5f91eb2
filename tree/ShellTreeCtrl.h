// The shell folder tree: the shell namespace as the Windows shell presents it, rooted at the Desktop,
// folders only, each node filled with its sub-folders when it is first expanded (behind the waiting
// control's animation). Selecting a folder makes it the explorer's current folder: the tree scans it into
// the drawing list and tells its owner, which rebuilds the grid.
//
// Each item's data is a CShellNode (the folder that enumerated it, its absolute item id list, its
// enumeration flags), created when the item is inserted and destroyed with it.
//
// Wiring. The owner sets the document (the explorer's settings: current folder and label path) and the
// handlers; a handler left empty is not called. Nothing here reaches the frame or the grid directly.
#pragma once

#include "tree/ShellNode.h"
#include "tree/WaitingTreeCtrl.h"

#include <functional>
#include <memory>
#include <string>

class CTessel3Doc;
class DrawingFolder;

class CShellTreeCtrl : public CWaitingTreeCtrl {
public:
    // Attributes supplied on demand (TVN_GETDISPINFO) instead of at insertion.
    enum CallbackMask : UINT {
        kCallbackText = 0x01,
        kCallbackImage = 0x02,
        kCallbackSelectedImage = 0x20,
        kCallbackChildren = 0x40,
    };

    CShellTreeCtrl();
    ~CShellTreeCtrl() override;

    // Set by the owner.
    // A node without a file-system path (Desktop, My Computer) was selected: the grid is empty, and the
    // node's label names what is shown.
    std::function<void(const std::string& label)> onNoFolderShown;
    // A right click in the tree: on a node, or below the items, where it stands for the selected
    // (highlighted) folder. at: where the menu goes, on the screen. True when a menu was shown.
    std::function<bool(HTREEITEM, CPoint at)> onFolderMenu;
    // The walk to the start folder has ended (WalkToStartLater); reached: a node was selected.
    std::function<void(bool reached)> onWalkEnded;
    void SetDocument(CTessel3Doc* doc) { m_pDoc = doc; }
    // The folder model the selected node's folder is shown in (not owned).
    void SetDrawingFolder(DrawingFolder* folder) { m_pFolder = folder; }

    UINT GetCallbackMask() const { return m_nCallbackMask; }
    void SetCallbackMask(UINT mask) { m_nCallbackMask = mask & 0x63; }

    // Null root: one top node, the Desktop. Otherwise that folder's children are the top-level nodes.
    void PopulateTree(LPCITEMIDLIST root, std::uint32_t flags);
    // A copy of the node's absolute item id list; empty when the item has no record.
    CShellPidl CopyItemId(HTREEITEM item) const;
    // The node's record, or null.
    CShellNode* NodeOf(HTREEITEM item) const;
    // "Desktop\My Computer\C:\dir": the labels from the top node down to the item; empty for null.
    std::string GetLabelPath(HTREEITEM item) const;
    // Expands the nodes named by a label path (case ignored), filling each on the way; the last one
    // becomes the path target. An empty component ends the walk; a name that matches no node stops it
    // and leaves the path target as it was. Selects nothing. With openTarget false the path target itself
    // is left closed: OpenPathTargetLater opens it.
    void ExpandToLabelPath(const std::string& labelPath, bool openTarget = true);
    // Expands the path target once the messages queued now have been handled. The explorer opens with
    // its start folder closed and has it opened so: filling it means reading the whole folder for its
    // sub-folders (the better part of a second for 100,000 drawings under Wine), which the first
    // pictures need not wait for. Nothing happens when the node has gone meanwhile. A node whose folder
    // the folder model is still reading on its scan's thread is left closed: filling it would read that
    // folder again on the host's thread (seconds for a million files, Escape waiting), and a folder slow
    // to read is slow to open; the user opens it.
    void OpenPathTargetLater();
    // The walk the explorer makes when it opens, once the messages queued now have been handled: the grid
    // shows the start folder by its path first, and the tree follows. Expands the nodes along the
    // document's label path and selects the node reached; its folder is scanned only when it is not the
    // document's folder already (then the grid keeps what it shows); when none is reached, nothing stays
    // selected. The tree is shown (the explorer hides it until then: a tree drawn before it has walked
    // would show the Desktop alone and ask the shell for icons the first pictures need not wait for) and
    // opens the node reached (OpenPathTargetLater). The focus stays where it is. Selections are followed
    // from then on. onWalkEnded says how it went.
    void WalkToStartLater();
    // The file-system path of a node, or empty for a virtual folder and for the Desktop at the top.
    std::string FolderPathOf(HTREEITEM item) const;
    // Shows the item's folder in the folder model: the document's label path first; a node with a
    // file-system path is shown (read, made the current folder), one without shows no folder. True when
    // a folder was read.
    bool ShowFolder(HTREEITEM item);
    // Shows the selected node's folder again.
    void RefreshCurrentFolder();
    // Whether a selection change scans its folder (on after construction). The explorer holds it off while
    // it opens: a tree control that gets the focus without a selection selects its first visible item,
    // which would scan a folder the user never asked for.
    void FollowSelection(bool follow) { m_bFollowSelection = follow; }
    // Whether an Escape now answers a right click that opened no menu (My Computer has none): the person
    // pressed it to close the menu they expected, not the explorer. Asking ends it: one Escape at most.
    bool TakeEscapeForMissingMenu();

protected:
    void PreSubclassWindow() override;
    bool PopulateItem(HTREEITEM node) override;
    bool OnNotifyReflect(NMHDR* hdr, LRESULT* result) override;
    void OnDestroy() override;
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;

private:
    // A child made ready to go into the tree: its record and its item, whose label is computed (unless the
    // tree asks for it on demand).
    struct PreparedNode {
        std::unique_ptr<CShellNode> node;
        TVITEMA item{};
        std::string label;
    };
    PreparedNode PrepareNode(IShellFolder* parentFolder, LPCITEMIDLIST parentId, LPCITEMIDLIST relativeId,
                             std::uint32_t flags) const;
    HTREEITEM InsertPrepared(HTREEITEM parent, PreparedNode& prepared);
    HTREEITEM InsertNode(HTREEITEM parent, IShellFolder* parentFolder, LPCITEMIDLIST parentId,
                         LPCITEMIDLIST relativeId, std::uint32_t flags);
    void FillDisplayInfo(TVITEMA& item, const CShellNode& node, UINT mask, bool wideText) const;
    int PlainFolderIcon(const std::string& path, bool open) const;
    bool PopulateNode(HTREEITEM item, LPCITEMIDLIST absoluteId, std::uint32_t flags);
    void OnSelChanged(HTREEITEM item);
    void OnRightClick();
    void HighlightSelected(HTREEITEM item);
    void WalkToStart();
    void TakeShellIcons();
    static int CALLBACK CompareNodes(LPARAM a, LPARAM b, LPARAM);

    CDesktopFolderRef m_desktop;
    UINT m_nCallbackMask = 0;
    // The plain folder's icon, closed and open, once the shell has been asked (-1: not yet).
    mutable int m_plainIcon[2] = {-1, -1};
    CTessel3Doc* m_pDoc = nullptr;
    DrawingFolder* m_pFolder = nullptr;
    bool m_bClosing = false; // the window is going: selection changes are no longer folder changes
    bool m_bFollowSelection = true;
    HTREEITEM m_hOpenLater = nullptr; // the node OpenPathTargetLater will expand; cleared when it goes
    bool m_bMenuMissing = false;      // the last right click opened no menu, and nothing came since
};
