#include "tree/ShellTreeCtrl.h"

#include "hostapi/NarrowText.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DrawingFolder.h"
#include "tree/ShellNamespace.h"

#include <shellapi.h>
#include <windowsx.h>

#include <cstring>
#include <memory>
#include <string>
#include <vector>

namespace {

constexpr UINT kInsertMask = TVIF_TEXT | TVIF_IMAGE | TVIF_PARAM | TVIF_SELECTEDIMAGE | TVIF_CHILDREN;
constexpr int kLabelChars = MAX_PATH;

// The number of ids in an item id list.
int ItemIdCount(LPCITEMIDLIST pidl) {
    int count = 0;
    for (auto* p = reinterpret_cast<const BYTE*>(pidl); p && reinterpret_cast<const SHITEMID*>(p)->cb != 0;
         p += reinterpret_cast<const SHITEMID*>(p)->cb)
        ++count;
    return count;
}

// Whether a folder on a drive may carry an icon of its own: only one marked read-only or system (or a link
// of the file system) may; the shell draws every other folder with the plain folder icon.
bool IsMarkedFolder(DWORD fileAttributes) {
    constexpr DWORD kMarks = FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_REPARSE_POINT;
    return fileAttributes == INVALID_FILE_ATTRIBUTES || !(fileAttributes & FILE_ATTRIBUTE_DIRECTORY) ||
           (fileAttributes & kMarks);
}

// The path of an item the shell draws with the plain folder icon, empty for any other: a folder below a
// drive's root, reached through a file-system folder (not an item of the Desktop or of My Computer, which
// have icons of their own), and not marked. Asking the shell about a folder itself makes it look for a
// desktop.ini there, and Wine finds a name by reading the whole folder: half a second for a folder of 100,000
// drawings, paid on the tree's first paint.
std::string PlainFolderPath(LPCITEMIDLIST absoluteId, SFGAOF attributes) {
    std::string path;
    if (!(attributes & SFGAO_FOLDER) || ItemIdCount(absoluteId) < 3 ||
        !ShellFileSystemPath(absoluteId, path) || path.size() <= 3 || path.compare(1, 2, ":\\") != 0 ||
        IsMarkedFolder(::GetFileAttributesA(path.c_str())))
        path.clear();
    return path;
}

// The system small icon of an item (open: the opened-folder form).
int SmallIconOf(LPCSTR pathOrId, bool isId, bool open) {
    SHFILEINFOA info{};
    const UINT how =
        SHGFI_SYSICONINDEX | SHGFI_SMALLICON | (open ? SHGFI_OPENICON : 0) | (isId ? SHGFI_PIDL : 0);
    if (!::SHGetFileInfoA(pathOrId, 0, &info, sizeof info, how))
        return 0;
    return info.iIcon;
}

// Copies a label into the request's buffer, narrow or wide as the request asks.
void CopyLabel(TVITEMA& item, const std::string& label, bool wideText) {
    if (!item.pszText || item.cchTextMax <= 0)
        return;
    if (!wideText) {
        ::lstrcpynA(item.pszText, label.c_str(), item.cchTextMax);
        return;
    }
    auto* wide = reinterpret_cast<wchar_t*>(item.pszText);
    const int n = ::MultiByteToWideChar(CP_ACP, 0, label.c_str(), -1, wide, item.cchTextMax);
    if (n == 0)
        wide[item.cchTextMax - 1] = L'\0'; // too long: cut, as lstrcpyn would
    wide[item.cchTextMax - 1] = L'\0';
}

} // namespace

CShellTreeCtrl::CShellTreeCtrl() = default;

CShellTreeCtrl::~CShellTreeCtrl() = default;

void CShellTreeCtrl::PreSubclassWindow() {
    CWaitingTreeCtrl::PreSubclassWindow();
    // Asked for once the control is set up and the messages queued before are done: the first request
    // makes the shell build its image lists (tens of milliseconds), which the explorer's first pictures
    // need not wait for.
    PostMessage(WM_ORVEX_TREE_ICONS);
}

void CShellTreeCtrl::TakeShellIcons() {
    if (GetImageList(TVSIL_NORMAL))
        return;
    CShellPidl desktop;
    if (FAILED(::SHGetSpecialFolderLocation(m_hWnd, CSIDL_DESKTOP, desktop.Receive())) || !desktop)
        return;
    SHFILEINFOA info{};
    const auto list = reinterpret_cast<HIMAGELIST>(
        ::SHGetFileInfoA(reinterpret_cast<LPCSTR>(desktop.get()), 0, &info, sizeof info,
                         SHGFI_SYSICONINDEX | SHGFI_SMALLICON | SHGFI_PIDL));
    if (list)
        SetImageList(list, TVSIL_NORMAL);
}

void CShellTreeCtrl::OnDestroy() {
    m_bClosing = true;
    // The records go while the owner still reflects the deletions to this object.
    DeleteAllItems();
    CWaitingTreeCtrl::OnDestroy();
}

CShellNode* CShellTreeCtrl::NodeOf(HTREEITEM item) const {
    if (!item || item == TVI_ROOT)
        return nullptr;
    return reinterpret_cast<CShellNode*>(GetItemData(item));
}

CShellPidl CShellTreeCtrl::CopyItemId(HTREEITEM item) const {
    const CShellNode* node = NodeOf(item);
    return node ? CShellPidl::CopyOf(node->AbsoluteId()) : CShellPidl();
}

void CShellTreeCtrl::PopulateTree(LPCITEMIDLIST root, std::uint32_t flags) {
    if (!m_desktop)
        return;
    if (!root) {
        CShellPidl desktopId;
        if (FAILED(::SHGetSpecialFolderLocation(m_hWnd, CSIDL_DESKTOP, desktopId.Receive())) || !desktopId)
            return;
        InsertNode(TVI_ROOT, m_desktop.get(), nullptr, desktopId.get(), flags);
        return;
    }
    SendMessage(WM_SETREDRAW, FALSE);
    PopulateNode(TVI_ROOT, root, flags);
    SendMessage(WM_SETREDRAW, TRUE);
}

CShellTreeCtrl::PreparedNode CShellTreeCtrl::PrepareNode(IShellFolder* parentFolder, LPCITEMIDLIST parentId,
                                                         LPCITEMIDLIST relativeId,
                                                         std::uint32_t flags) const {
    PreparedNode prepared;
    CShellPidl absolute = CShellPidl::Concat(parentId, relativeId);
    if (!absolute)
        return prepared;
    prepared.node = std::make_unique<CShellNode>(parentFolder, std::move(absolute), flags);
    char label[kLabelChars] = "";
    TVITEMA& item = prepared.item;
    item.mask = kInsertMask;
    item.pszText = label;
    item.cchTextMax = kLabelChars;
    item.lParam = reinterpret_cast<LPARAM>(prepared.node.get());
    // What is not supplied on demand is computed now.
    FillDisplayInfo(item, *prepared.node, kInsertMask & ~m_nCallbackMask, false);
    prepared.label = label;
    item.pszText = nullptr; // the label's own copy is pointed at when the item goes in
    if (m_nCallbackMask & kCallbackText)
        item.pszText = LPSTR_TEXTCALLBACKA;
    if (m_nCallbackMask & kCallbackImage)
        item.iImage = I_IMAGECALLBACK;
    if (m_nCallbackMask & kCallbackSelectedImage)
        item.iSelectedImage = I_IMAGECALLBACK;
    if (m_nCallbackMask & kCallbackChildren)
        item.cChildren = I_CHILDRENCALLBACK;
    item.mask |= kInsertMask; // the state bits the fill added stay
    return prepared;
}

HTREEITEM CShellTreeCtrl::InsertPrepared(HTREEITEM parent, PreparedNode& prepared) {
    if (!prepared.node)
        return nullptr;
    TVINSERTSTRUCTA insert{};
    insert.hParent = parent;
    insert.hInsertAfter = TVI_LAST;
    insert.item = prepared.item;
    if (!insert.item.pszText)
        insert.item.pszText = const_cast<char*>(prepared.label.c_str());
    HTREEITEM item = InsertItem(&insert);
    if (item)
        prepared.node.release(); // the item owns it now; TVN_DELETEITEM frees it
    return item;
}

HTREEITEM CShellTreeCtrl::InsertNode(HTREEITEM parent, IShellFolder* parentFolder, LPCITEMIDLIST parentId,
                                     LPCITEMIDLIST relativeId, std::uint32_t flags) {
    PreparedNode prepared = PrepareNode(parentFolder, parentId, relativeId, flags);
    return InsertPrepared(parent, prepared);
}

void CShellTreeCtrl::FillDisplayInfo(TVITEMA& item, const CShellNode& node, UINT mask, bool wideText) const {
    IShellFolder* folder = node.ParentFolder();
    LPCITEMIDLIST relative = node.RelativeId();
    if (mask & TVIF_TEXT)
        CopyLabel(item, ShellLabelOf(folder, node.AbsoluteId(), node.Flags()), wideText);

    if (mask & (TVIF_IMAGE | TVIF_SELECTEDIMAGE)) {
        SFGAOF attributes = SFGAO_GHOSTED | SFGAO_LINK | SFGAO_SHARE | SFGAO_FOLDER;
        if (!folder || !relative || FAILED(folder->GetAttributesOf(1, &relative, &attributes)))
            attributes = 0;
        if (attributes & SFGAO_GHOSTED) {
            item.mask |= TVIF_STATE;
            item.state |= TVIS_CUT;
            item.stateMask |= TVIS_CUT;
        }
        if (attributes & (SFGAO_SHARE | SFGAO_LINK)) {
            item.mask |= TVIF_STATE;
            item.state &= ~TVIS_OVERLAYMASK;
            item.state |= INDEXTOOVERLAYMASK((attributes & SFGAO_SHARE) ? 1 : 2);
            item.stateMask |= TVIS_OVERLAYMASK;
        }
        const std::string plain = PlainFolderPath(node.AbsoluteId(), attributes);
        const auto id = reinterpret_cast<LPCSTR>(node.AbsoluteId());
        if (mask & TVIF_IMAGE)
            item.iImage = item.iSelectedImage =
                plain.empty() ? SmallIconOf(id, true, false) : PlainFolderIcon(plain, false);
        if ((mask & TVIF_SELECTEDIMAGE) && (attributes & SFGAO_FOLDER))
            item.iSelectedImage = plain.empty() ? SmallIconOf(id, true, true) : PlainFolderIcon(plain, true);
    }

    if (mask & TVIF_CHILDREN)
        item.cChildren = ShellHasChildren(folder, relative, node.Flags()) ? 1 : 0;
}

int CShellTreeCtrl::PlainFolderIcon(const std::string& path, bool open) const {
    int& icon = m_plainIcon[open ? 1 : 0];
    if (icon >= 0)
        return icon;
    // Every plain folder has the icon of the first plain folder on the path, the one nearest the drive's
    // root: the cheapest to ask about, as such folders hold few entries.
    std::string folder = path;
    for (std::size_t slash = FindCharacter(path, '\\', 3); slash != std::string::npos;
         slash = FindCharacter(path, '\\', slash + 1)) {
        if (!IsMarkedFolder(::GetFileAttributesA(path.substr(0, slash).c_str()))) {
            folder = path.substr(0, slash);
            break;
        }
    }
    icon = SmallIconOf(folder.c_str(), false, open);
    return icon;
}

bool CShellTreeCtrl::PopulateNode(HTREEITEM item, LPCITEMIDLIST absoluteId, std::uint32_t flags) {
    IShellFolder* folder = BindShellFolder(m_desktop.get(), absoluteId);
    if (!folder)
        return false;
    const SHCONTF what = SHCONTF_FOLDERS | ((flags & kShellNonFolders) ? SHCONTF_NONFOLDERS : 0) |
                         ((flags & kShellHidden) ? SHCONTF_INCLUDEHIDDEN : 0);
    IEnumIDList* enumerator = nullptr;
    if (FAILED(folder->EnumObjects(m_hWnd, what, &enumerator)))
        enumerator = nullptr;
    // Released however the filling ends.
    struct Release {
        IShellFolder* folder;
        IEnumIDList*& enumerator;
        ~Release() {
            if (enumerator)
                enumerator->Release();
            folder->Release();
        }
    } release{folder, enumerator};
    if (enumerator) {
        // First every child is read from the shell, then they all go into the tree: Escape while reading
        // leaves nothing in the tree to take out again, which under some systems costs as much per item
        // as the tree holds. The node is folded while they go in: a child inserted into an expanded node
        // costs a walk of all the tree shows below it.
        SetPopulationCount(0, 0);
        std::vector<PreparedNode> children;
        bool stopped = false;
        LPITEMIDLIST child = nullptr;
        while (!(stopped = FillCancelled()) && enumerator->Next(1, &child, nullptr) == S_OK) {
            CShellPidl relative(child);
            children.push_back(PrepareNode(folder, absoluteId, relative.get(), flags & kShellInherited));
            IncreasePopulation(1);
        }
        // The bar stays where the reading left it (the total was not known) until the end.
        const bool expanded = item != TVI_ROOT && (GetItemState(item, TVIS_EXPANDED) & TVIS_EXPANDED);
        if (expanded)
            SetItemState(item, 0, TVIS_EXPANDED);
        for (std::size_t i = 0; i < children.size() && !stopped; ++i) {
            if (!(stopped = FillCancelled()))
                InsertPrepared(item, children[i]);
        }
        if (expanded)
            SetItemState(item, TVIS_EXPANDED, TVIS_EXPANDED);
        if (stopped)
            return true;
        if (GetPopulationCount() > 0) {
            TVSORTCB sort{};
            sort.hParent = item;
            sort.lpfnCompare = &CShellTreeCtrl::CompareNodes;
            sort.lParam = 0;
            SortChildrenCB(&sort);
        }
        SetPopulationCount(1, 1);
    }
    return true;
}

int CALLBACK CShellTreeCtrl::CompareNodes(LPARAM a, LPARAM b, LPARAM) {
    const auto* first = reinterpret_cast<const CShellNode*>(a);
    const auto* second = reinterpret_cast<const CShellNode*>(b);
    if (!first || !second || !second->ParentFolder())
        return 0;
    return CompareShellIds(second->ParentFolder(), first->RelativeId(), second->RelativeId());
}

bool CShellTreeCtrl::PopulateItem(HTREEITEM node) {
    if (node == TVI_ROOT)
        return true;
    const CShellNode* record = NodeOf(node);
    if (!record)
        return true;
    if (!PopulateNode(node, record->AbsoluteId(), record->Flags()))
        return true;
    std::string path;
    if (!ShellFileSystemPath(record->AbsoluteId(), path) || path.size() < 3)
        return true; // a virtual folder
    // Folders on removable, optical and network drives keep their button when they turned out empty:
    // the medium may be in later.
    return ::GetDriveTypeA(path.substr(0, 3).c_str()) == DRIVE_FIXED;
}

std::string CShellTreeCtrl::GetLabelPath(HTREEITEM item) const {
    std::string path;
    if (!item)
        return path;
    path = GetItemText(item);
    for (HTREEITEM parent = GetParentItem(item); parent; parent = GetParentItem(parent))
        path = GetItemText(parent) + "\\" + path;
    return path;
}

void CShellTreeCtrl::ExpandToLabelPath(const std::string& labelPath, bool openTarget) {
    HTREEITEM current = nullptr;
    const std::vector<std::string> names = SplitLabelPath(labelPath);
    for (std::size_t i = 0; i < names.size(); ++i) {
        const std::string& component = names[i];
        if (component.empty())
            break;
        HTREEITEM candidate = current ? GetChildItem(current) : GetRootItem();
        while (candidate && ::lstrcmpiA(GetItemText(candidate).c_str(), component.c_str()) != 0)
            candidate = GetNextSiblingItem(candidate);
        if (!candidate)
            return;                                                      // the path target keeps what it had
        const bool last = i + 1 == names.size() || names[i + 1].empty(); // no component follows
        // The nodes on the way are filled at once: an animated filling costs a thread and a paint apiece.
        if (!last)
            FillWithoutAnimation(candidate);
        if (openTarget || !last)
            Expand(candidate, TVE_EXPAND);
        current = candidate;
    }
    if (current)
        m_hPathTarget = current;
}

void CShellTreeCtrl::OpenPathTargetLater() {
    m_hOpenLater = m_hPathTarget;
    if (m_hOpenLater)
        PostMessage(WM_ORVEX_OPEN_TARGET);
}

void CShellTreeCtrl::WalkToStartLater() {
    PostMessage(WM_ORVEX_WALK_START);
}

void CShellTreeCtrl::WalkToStart() {
    if (m_bClosing)
        return;
    TakeShellIcons(); // normally queued before and taken already
    // Walked hidden, as the explorer keeps it until now: a tree that shows costs several times as much to
    // fill and select in (about 150 ms against 30 for the walk to a folder of the benchmarks).
    const std::string shownFolder = m_pFolder ? m_pFolder->Folder() : std::string();
    if (m_pDoc)
        ExpandToLabelPath(m_pDoc->m_strShellPath, false);
    HTREEITEM target = m_hPathTarget;
    if (target) {
        const bool shown = DrawingFolder::SameFolder(FolderPathOf(target), shownFolder);
        SelectItem(nullptr); // the target may be the item the control chose on its own: selected anew
        SelectSetFirstVisible(target);
        SelectDropTarget(target);
        FollowSelection(!shown);
        SelectItem(target);
        if (shown) {
            if (m_pDoc)
                m_pDoc->m_strShellPath = GetLabelPath(target);
            HighlightSelected(target);
        }
        EnsureVisible(target); // sideways too: a deep folder in a narrow pane
    } else {
        SelectItem(nullptr); // the item the control chose when it got the focus, if it did
    }
    FollowSelection(true);
    ShowWindow(SW_SHOW);
    if (target)
        OpenPathTargetLater();
    if (onWalkEnded)
        onWalkEnded(target != nullptr);
}

LRESULT CShellTreeCtrl::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_ORVEX_TREE_ICONS:
        TakeShellIcons();
        return 0;
    case WM_ORVEX_WALK_START:
        WalkToStart();
        return 0;
    case WM_ORVEX_OPEN_TARGET: {
        HTREEITEM item = m_hOpenLater;
        m_hOpenLater = nullptr;
        // Left closed: filling the node would read the folder being read again, on this thread.
        if (m_pFolder && m_pFolder->IsScanning())
            return 0;
        if (item && !m_bClosing)
            Expand(item, TVE_EXPAND);
        return 0;
    }
    case WM_KEYDOWN:
    case WM_RBUTTONDOWN:
    case WM_MBUTTONDOWN:
    case WM_KILLFOCUS:
        m_bMenuMissing = false; // the person has moved on
        return CWaitingTreeCtrl::WindowProc(message, wParam, lParam);
    case WM_LBUTTONDOWN: {
        m_bMenuMissing = false;
        // A click on the folder already selected changes no selection: it reads that folder again, so a
        // drawing another program added meanwhile shows.
        UINT flags = 0;
        HTREEITEM hit = HitTest(CPoint(GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam)), &flags);
        HTREEITEM selected = GetSelectedItem();
        HWND self = m_hWnd;
        const LRESULT result = CWaitingTreeCtrl::WindowProc(message, wParam, lParam);
        if (hit && hit == selected && (flags & TVHT_ONITEM) && ::IsWindow(self) && !m_bClosing &&
            m_bFollowSelection && GetSelectedItem() == hit)
            ShowFolder(hit);
        return result;
    }
    default:
        return CWaitingTreeCtrl::WindowProc(message, wParam, lParam);
    }
}

std::string CShellTreeCtrl::FolderPathOf(HTREEITEM item) const {
    const CShellNode* node = NodeOf(item);
    std::string path;
    // The Desktop, the namespace's root, is not a folder of files here even where the shell gives it the
    // user's desktop directory: it holds My Computer, the network and the rest.
    // Whole however long: a folder too long for the runtime is named by its own path and refused as such,
    // not by a cut path that names another.
    if (node && ItemIdListSize(node->AbsoluteId()) > 0)
        ShellFileSystemPath(node->AbsoluteId(), path, kLongestPathChars + 1);
    return path;
}

bool CShellTreeCtrl::ShowFolder(HTREEITEM item) {
    if (m_pDoc)
        m_pDoc->m_strShellPath = GetLabelPath(item);
    if (!m_pFolder)
        return false;
    const std::string path = FolderPathOf(item);
    if (path.empty()) {
        // Desktop, My Computer and the like: the folder shown stays what it was, with nothing in it.
        m_pFolder->ShowNoFolder();
        if (onNoFolderShown)
            onNoFolderShown(GetItemText(item));
        return false;
    }
    return m_pFolder->Show(path);
}

void CShellTreeCtrl::RefreshCurrentFolder() {
    if (HTREEITEM item = GetSelectedItem())
        ShowFolder(item);
}

void CShellTreeCtrl::OnSelChanged(HTREEITEM item) {
    if (m_bClosing || !m_bFollowSelection || !item)
        return;
    ShowFolder(item);
    HighlightSelected(item);
    SetFocus();
}

void CShellTreeCtrl::HighlightSelected(HTREEITEM item) {
    // Stays highlighted while the focus is in the grid.
    SelectDropTarget(item);
    if (GetDropHilightItem() != item) {
        // A control that will not highlight its selected item (Wine's) would keep the highlight on the
        // item before: none stays elsewhere, and the selection itself shows while the focus is away.
        SelectDropTarget(nullptr);
        ModifyStyle(0, TVS_SHOWSELALWAYS);
    }
}

void CShellTreeCtrl::OnRightClick() {
    CPoint screen;
    ::GetCursorPos(&screen);
    CPoint client = screen;
    ::ScreenToClient(m_hWnd, &client);
    UINT flags = 0;
    HTREEITEM item = HitTest(client, &flags);
    CPoint at = screen;
    if (item && (flags & TVHT_ONITEM)) {
        // Beside the folder it is for.
        CRect text;
        if (GetItemRect(item, &text, true)) {
            ClientToScreen(&text);
            at = CPoint(text.right, text.bottom);
        }
    } else {
        // Beside an item's row, or below the items: the folder shown, the one highlighted.
        item = GetDropHilightItem();
        if (!item)
            item = GetSelectedItem();
    }
    const HWND self = m_hWnd;
    const bool shown = item && onFolderMenu && onFolderMenu(item, at);
    if (::IsWindow(self))
        m_bMenuMissing = !shown;
}

bool CShellTreeCtrl::TakeEscapeForMissingMenu() {
    const bool missing = m_bMenuMissing;
    m_bMenuMissing = false;
    return missing;
}

bool CShellTreeCtrl::OnNotifyReflect(NMHDR* hdr, LRESULT* result) {
    const UINT code = AfxTreeNotifyCode(hdr->code);
    switch (code) {
    case TVN_DELETEITEMA: {
        const auto* tv = reinterpret_cast<const NMTREEVIEWA*>(hdr);
        if (tv->itemOld.hItem == m_hOpenLater)
            m_hOpenLater = nullptr;
        delete reinterpret_cast<CShellNode*>(tv->itemOld.lParam);
        *result = 0;
        return true;
    }
    case TVN_GETDISPINFOA: {
        auto* info = reinterpret_cast<NMTVDISPINFOA*>(hdr);
        if (const auto* node = reinterpret_cast<const CShellNode*>(info->item.lParam)) {
            FillDisplayInfo(info->item, *node, info->item.mask, hdr->code == TVN_GETDISPINFOW);
            // The control keeps what it was given: each attribute is asked for once, when first shown.
            info->item.mask |= TVIF_DI_SETITEM;
        }
        *result = 0;
        return true;
    }
    case TVN_SELCHANGEDA:
        OnSelChanged(reinterpret_cast<const NMTREEVIEWA*>(hdr)->itemNew.hItem);
        *result = 0;
        return true;
    case TVN_SELCHANGINGA:
    case TVN_KEYDOWN:
    case NM_SETFOCUS:
    case NM_KILLFOCUS:
        *result = 0;
        return true;
    case NM_RCLICK:
        OnRightClick();
        *result = 1; // the control's own handling would send a context-menu message too
        return true;
    default:
        return CWaitingTreeCtrl::OnNotifyReflect(hdr, result);
    }
}
