#include "tree/WaitingTreeCtrl.h"

#include <mmsystem.h>

#include <optional>
#include <utility>

// One filling's animation: the two auto-reset events (initially signalled, so that the thread draws once
// at once), the thread and the timer. Ending it stops the timer, wakes the thread with the stop flag set,
// waits for it and closes everything, then lets the drawings release their objects (PostAnimation).
class CWaitingTreeCtrl::Animation {
public:
    explicit Animation(CWaitingTreeCtrl& tree) : m_tree(tree) {
        m_tree.m_bStop = false;
        m_events[0] = ::CreateEventA(nullptr, FALSE, TRUE, nullptr); // timer ticks
        m_events[1] = ::CreateEventA(nullptr, FALSE, TRUE, nullptr); // progress reports, repaints
        if (!m_events[0] || !m_events[1])
            return;
        m_tree.m_hRefreshEvent = m_events[1];
        m_thread = ::CreateThread(nullptr, 0, &CWaitingTreeCtrl::AnimationThread, this, 0, nullptr);
        if (m_thread && m_tree.m_nPeriod != 0)
            m_timer = ::timeSetEvent(m_tree.m_nPeriod, 5, reinterpret_cast<LPTIMECALLBACK>(m_events[0]), 0,
                                     TIME_PERIODIC | TIME_CALLBACK_EVENT_SET);
    }
    ~Animation() {
        if (m_timer)
            ::timeKillEvent(m_timer);
        m_tree.m_bStop = true;
        if (m_events[1])
            ::SetEvent(m_events[1]);
        if (m_thread) {
            ::WaitForSingleObject(m_thread, INFINITE);
            ::CloseHandle(m_thread);
        }
        m_tree.m_hRefreshEvent = nullptr;
        for (HANDLE event : m_events)
            if (event)
                ::CloseHandle(event);
        m_tree.PostAnimation();
    }
    Animation(const Animation&) = delete;
    Animation& operator=(const Animation&) = delete;

    void Run() {
        while (!m_tree.m_bStop) {
            const DWORD woken = ::WaitForMultipleObjects(2, m_events, FALSE, INFINITE);
            if (woken > WAIT_OBJECT_0 + 1 || m_tree.m_bStop)
                return;
            m_tree.DoAnimation(woken == WAIT_OBJECT_0, m_tree.m_nItemTotal, m_tree.m_nItemCount);
        }
    }

private:
    CWaitingTreeCtrl& m_tree;
    HANDLE m_events[2] = {nullptr, nullptr};
    HANDLE m_thread = nullptr;
    MMRESULT m_timer = 0;
};

DWORD WINAPI CWaitingTreeCtrl::AnimationThread(void* param) {
    try {
        static_cast<Animation*>(param)->Run();
    } catch (...) { // a drawing that failed ends the animation, not the process
    }
    return 0;
}

CWaitingTreeCtrl::CWaitingTreeCtrl() = default;

CWaitingTreeCtrl::~CWaitingTreeCtrl() = default;

int CWaitingTreeCtrl::GetPopulationCount(int* total) const {
    if (total)
        *total = m_nItemTotal;
    return m_nItemCount;
}

void CWaitingTreeCtrl::SetPopulationCount(int total, int count) {
    m_nItemTotal = total;
    m_nItemCount = count;
    if (HANDLE event = m_hRefreshEvent)
        ::SetEvent(event);
}

void CWaitingTreeCtrl::IncreasePopulation(int count) {
    m_nItemCount += count;
    if (HANDLE event = m_hRefreshEvent)
        ::SetEvent(event);
}

bool CWaitingTreeCtrl::FillCancelled() {
    if (m_bFillCancelled)
        return true;
    const ULONGLONG now = ::GetTickCount64();
    if (now < m_nNextFillCheck)
        return false;
    m_nNextFillCheck = now + kFillCheckMs;
    // A repaint asked for meanwhile (another window moved away, an invalidation): the snapshot, then the
    // bar over it. Painted directly, not taken from the queue, which belongs to the loop outside.
    ::UpdateWindow(m_hWnd);
    // Looking at the queue also answers what other threads send the tree meanwhile.
    MSG msg;
    if (::PeekMessageA(&msg, nullptr, WM_KEYDOWN, WM_KEYDOWN, PM_NOREMOVE) && msg.wParam == VK_ESCAPE)
        m_bFillCancelled = true;
    return m_bFillCancelled;
}

bool CWaitingTreeCtrl::OnNotifyReflect(NMHDR* hdr, LRESULT* result) {
    const UINT code = AfxTreeNotifyCode(hdr->code);
    if (code != TVN_ITEMEXPANDINGA && code != TVN_ITEMEXPANDEDA)
        return false;
    const auto* tv = reinterpret_cast<const NMTREEVIEWA*>(hdr);
    HTREEITEM node = tv->itemNew.hItem;
    *result = 0;
    if (code == TVN_ITEMEXPANDINGA) {
        if (tv->action & TVE_EXPAND)
            OnItemExpanding(node, tv->action);
    } else if (tv->action & TVE_EXPAND) {
        if (m_hItemToPopulate && m_hItemToPopulate == node)
            Populate(std::exchange(m_hItemToPopulate, nullptr));
    } else if ((tv->action & TVE_COLLAPSE) && WantsRefresh()) {
        DeleteChildren(node);
        // The button stays, so that the node can be filled again.
        TVITEMA tvi{};
        tvi.mask = TVIF_HANDLE | TVIF_CHILDREN;
        tvi.hItem = node;
        tvi.cChildren = 1;
        SetItem(&tvi);
    }
    return true;
}

void CWaitingTreeCtrl::OnItemExpanding(HTREEITEM node, UINT) {
    m_hItemToPopulate = nullptr;
    if (GetChildItem(node)) {
        if (!WantsRefresh())
            return; // filled before: shown as it is
        DeleteChildren(node);
    }
    PrepareLoadingItem(node);
}

void CWaitingTreeCtrl::PrepareLoadingItem(HTREEITEM node) {
    m_hItemToPopulate = node;
    UpdateWindow();
    SendMessage(WM_SETREDRAW, FALSE);
    TVINSERTSTRUCTA insert{};
    insert.hParent = node;
    insert.hInsertAfter = TVI_LAST;
    insert.item.mask = TVIF_TEXT;
    insert.item.pszText = const_cast<char*>(m_strLoadingText.c_str());
    m_hLoadingItem = InsertItem(&insert);
    m_nItemTotal = 1;
    m_nItemCount = 0;
}

bool CWaitingTreeCtrl::FillWithoutAnimation(HTREEITEM node) {
    if (!node || node == TVI_ROOT || GetChildItem(node))
        return node && GetChildItem(node);
    if (PopulateItem(node)) {
        TVITEMA tvi{};
        tvi.mask = TVIF_HANDLE | TVIF_CHILDREN;
        tvi.hItem = node;
        tvi.cChildren = GetChildItem(node) ? 1 : 0;
        SetItem(&tvi);
    }
    return GetChildItem(node) != nullptr;
}

void CWaitingTreeCtrl::DeleteChildren(HTREEITEM node) {
    HTREEITEM child = GetChildItem(node);
    while (child) {
        HTREEITEM next = GetNextSiblingItem(child);
        DeleteItem(child);
        child = next;
    }
}

bool CWaitingTreeCtrl::GetLoadingIconRect(HTREEITEM loadingItem, CRect& rect) const {
    CRect label;
    if (!loadingItem || !GetImageList(TVSIL_NORMAL) || !GetItemRect(loadingItem, &label, true))
        return false;
    const int cx = ::GetSystemMetrics(SM_CXSMICON);
    const int cy = ::GetSystemMetrics(SM_CYSMICON);
    rect = CRect(label.left - 3 - cx, label.top + (label.Height() - cy) / 2, 0, 0);
    rect.right = rect.left + cx;
    rect.bottom = rect.top + cy;
    return true;
}

void CWaitingTreeCtrl::DrawLoadingIcon(HTREEITEM loadingItem) {
    CRect place;
    if (!GetLoadingIconRect(loadingItem, place))
        return;
    CGdiObjectT<HBRUSH> background(::CreateSolidBrush(GetEffectiveBkColor()));
    HDC dc = ::GetDC(m_hWnd);
    if (!dc)
        return;
    if (m_hLoadingIcon)
        ::DrawIconEx(dc, place.left, place.top, m_hLoadingIcon, place.Width(), place.Height(), 0, background,
                     DI_NORMAL);
    else
        ::FillRect(dc, &place, background);
    ::ReleaseDC(m_hWnd, dc);
}

void CWaitingTreeCtrl::Populate(HTREEITEM node) {
    // Paint the node with its loading item once, so that the label and the animation beside it show.
    SendMessage(WM_SETREDRAW, TRUE);
    UpdateWindow();

    HTREEITEM loading = m_hLoadingItem;
    PreAnimation(loading);
    // Runs last, also when the filling throws: the snapshot goes and the control draws again.
    struct SnapshotEnd {
        CWaitingTreeCtrl& tree;
        ~SnapshotEnd() {
            tree.m_bSnapshotValid = false;
            tree.m_bmpSnapshot.DeleteObject();
            tree.SendMessage(WM_SETREDRAW, TRUE);
            tree.Invalidate();
        }
    } snapshotEnd{*this};
    std::optional<Animation> animation;
    animation.emplace(*this);

    if (m_bShowLoadingIcon && GetImageList(TVSIL_NORMAL))
        DrawLoadingIcon(loading);

    SendMessage(WM_SETREDRAW, FALSE);
    const CRect client = GetClientRect();
    if (HDC dc = ::GetDC(m_hWnd)) {
        HDC memory = ::CreateCompatibleDC(dc);
        if (memory && m_bmpSnapshot.CreateCompatibleBitmap(dc, client.Width(), client.Height())) {
            HGDIOBJ old = ::SelectObject(memory, m_bmpSnapshot);
            ::BitBlt(memory, 0, 0, client.Width(), client.Height(), dc, 0, 0, SRCCOPY);
            ::SelectObject(memory, old);
            m_bSnapshotValid = true;
        }
        if (memory)
            ::DeleteDC(memory);
        ::ReleaseDC(m_hWnd, dc);
    }
    if (loading)
        DeleteItem(loading);
    m_hLoadingItem = nullptr;

    m_bFillCancelled = false;
    m_nNextFillCheck = 0;
    const bool keepButtonOnlyWithChildren = PopulateItem(node);
    animation.reset();

    if (std::exchange(m_bFillCancelled, false)) {
        // Stopped by the user: not filled is better than half filled, which would pass for the whole. The
        // children go in one collapse, not one deletion each: each deletion of an expanded node's child
        // walks the node's remaining children, many thousand of them.
        if (node != TVI_ROOT)
            SendMessage(TVM_EXPAND, TVE_COLLAPSE | TVE_COLLAPSERESET, reinterpret_cast<LPARAM>(node));
        DeleteChildren(node);
        if (node != TVI_ROOT) {
            TVITEMA tvi{};
            tvi.mask = TVIF_HANDLE | TVIF_CHILDREN;
            tvi.hItem = node;
            tvi.cChildren = 1;
            SetItem(&tvi);
            SetItemState(node, 0, TVIS_EXPANDED | TVIS_EXPANDEDONCE);
        }
    } else if (node != TVI_ROOT) {
        if (keepButtonOnlyWithChildren) {
            TVITEMA tvi{};
            tvi.mask = TVIF_HANDLE | TVIF_CHILDREN;
            tvi.hItem = node;
            tvi.cChildren = GetChildItem(node) ? 1 : 0;
            SetItem(&tvi);
        } else if (!GetChildItem(node)) {
            SetItemState(node, 0, TVIS_EXPANDED); // collapsed, the button stays
        }
    }
}

void CWaitingTreeCtrl::RefreshSubtree(HTREEITEM node) {
    if (node != TVI_ROOT && !GetChildItem(node))
        return;
    SCROLLINFO scroll{};
    scroll.cbSize = sizeof scroll;
    scroll.fMask = SIF_ALL;
    const bool root = node == TVI_ROOT;
    if (root)
        ::GetScrollInfo(m_hWnd, SB_VERT, &scroll);
    struct RedrawOn {
        CWaitingTreeCtrl& tree;
        ~RedrawOn() { tree.SendMessage(WM_SETREDRAW, TRUE); }
    } redrawOn{*this};
    SendMessage(WM_SETREDRAW, FALSE);
    DeleteChildren(node);
    PrepareLoadingItem(node);
    Populate(std::exchange(m_hItemToPopulate, nullptr));
    if (root) {
        ::SetScrollInfo(m_hWnd, SB_VERT, &scroll, TRUE);
        EnsureVisible(GetRootItem());
    }
}

bool CWaitingTreeCtrl::OnEraseBkgnd(CDC* pDC) {
    if (!m_bSnapshotValid)
        return CTreeCtrl::OnEraseBkgnd(pDC);
    if (HDC memory = ::CreateCompatibleDC(*pDC)) {
        HGDIOBJ old = ::SelectObject(memory, m_bmpSnapshot);
        BITMAP info{};
        ::GetObjectA(m_bmpSnapshot, sizeof info, &info);
        ::BitBlt(*pDC, 0, 0, info.bmWidth, info.bmHeight, memory, 0, 0, SRCCOPY);
        ::SelectObject(memory, old);
        ::DeleteDC(memory);
    }
    m_bRepainted = true;
    if (HANDLE event = m_hRefreshEvent)
        ::SetEvent(event);
    return true;
}
