// A tree control that fills a node's children when the node is expanded. While a derived class fills it
// (PopulateItem, on the user-interface thread) a temporary "Loading..." child stands in for the children
// and an animation thread redraws a small indicator beside it, woken by a multimedia timer and by the
// filling's progress reports. CProgressFX and CHourglassFX add the drawings by derivation:
// class CMyTree : public CHourglassFX<CProgressFX<CFillingTree>>.
//
// The animation thread only draws (into a client device context of its own) and never sends the control
// a message: the user-interface thread waits for it without a time limit at the end of a filling. The
// counts and the stop flag are atomics. Every handle, object and thread of a filling is released when
// the filling ends, also when PopulateItem throws.
#pragma once

#include "afxtree.h"
#include "tree/ProgressWidth.h"

#include <atomic>
#include <string>

class CWaitingTreeCtrl : public CTreeCtrl {
public:
    CWaitingTreeCtrl();
    ~CWaitingTreeCtrl() override;

    void SetLoadingText(const std::string& text) { m_strLoadingText = text; }
    // The icon drawn in the loading item's icon place (when the tree has an image list); not owned.
    void SetLoadingIcon(HICON icon, bool show = true) {
        m_hLoadingIcon = icon;
        m_bShowLoadingIcon = show;
    }
    // The animation timer's period in milliseconds; 0: no timer, the progress reports alone redraw.
    void SetAnimationPeriod(UINT milliseconds) { m_nPeriod = milliseconds; }
    // Items reported so far; total receives the expected total (0 or less when unknown).
    int GetPopulationCount(int* total = nullptr) const;

    // Deletes a node's children and fills it again (a node without children is left alone).
    void RefreshSubtree(HTREEITEM node);
    // The same for the top level, keeping the vertical scroll position.
    void RefreshRoot() { RefreshSubtree(TVI_ROOT); }

    // The node an expand-to-path walk reached last, null until then (for derived trees).
    HTREEITEM m_hPathTarget = nullptr;

    // Fills a node that has no children yet at once: no loading item, no animation, nothing drawn. For a
    // walk along a path, whose nodes a following expansion then shows as they are (unless the tree wants
    // them filled again). A node that stays empty keeps or loses its button as PopulateItem says. Returns
    // whether the node has children.
    bool FillWithoutAnimation(HTREEITEM node);

protected:
    // Animation hooks. PreAnimation and PostAnimation run on the user-interface thread before the
    // animation thread starts and after it ended; DoAnimation runs on the animation thread, on a timer
    // tick (tick true) or a progress report, and must neither throw nor send the control a message.
    virtual void PreAnimation(HTREEITEM loadingItem) {}
    virtual void DoAnimation(bool tick, int total, int count) {}
    virtual void PostAnimation() {}
    // True: an expanded node is filled again on every expansion, and emptied when it collapses.
    virtual bool WantsRefresh() { return false; }
    // Fills the node's children, reporting progress. true: the node keeps an expand button only if it
    // now has children; false: the button stays, and the node is collapsed when it stayed empty.
    virtual bool PopulateItem(HTREEITEM node) = 0;

    // Progress reports for PopulateItem.
    void SetPopulationCount(int total, int count);
    void IncreasePopulation(int count = 1);
    // For PopulateItem, between two items: true once the user has pressed Escape, and PopulateItem should
    // stop; the key stays in the queue for whoever handles it after the filling (Escape ends the explorer).
    // Looks at the queue at most every kFillCheckMs, however long an item takes or however many items there
    // are, and meanwhile lets the tree repaint (the snapshot, then the bar over it) and answers messages
    // other threads send. A filling that stopped leaves the node collapsed and empty, with its button.
    static constexpr unsigned kFillCheckMs = 40;
    bool FillCancelled();
    // For DoAnimation: true once after the tree painted its snapshot again, so that what is drawn over it
    // (the progress bar) is drawn again too.
    bool TakeRepaint() { return m_bRepainted.exchange(false); }

    // The rectangle of the loading item's icon place; false without an image list or a label rectangle.
    bool GetLoadingIconRect(HTREEITEM loadingItem, CRect& rect) const;
    // For DoAnimation: a device context of the control's client area, released with ReleaseDC.
    HDC GetAnimationDC() const { return ::GetDC(m_hWnd); }
    void ReleaseAnimationDC(HDC dc) const {
        ::GdiFlush();
        ::ReleaseDC(m_hWnd, dc);
    }

    bool OnNotifyReflect(NMHDR* hdr, LRESULT* result) override;
    bool OnEraseBkgnd(CDC* pDC) override;

private:
    class Animation;
    static DWORD WINAPI AnimationThread(void* param);
    void OnItemExpanding(HTREEITEM node, UINT action);
    void PrepareLoadingItem(HTREEITEM node);
    void Populate(HTREEITEM node);
    void DeleteChildren(HTREEITEM node);
    void DrawLoadingIcon(HTREEITEM loadingItem);

    std::atomic<HANDLE> m_hRefreshEvent{nullptr};
    std::atomic<bool> m_bStop{false};
    std::atomic<bool> m_bSnapshotValid{false};
    std::atomic<bool> m_bRepainted{false};
    unsigned long long m_nNextFillCheck = 0; // GetTickCount64 time of the next look at the queue
    bool m_bFillCancelled = false;
    CBitmap m_bmpSnapshot;
    UINT m_nPeriod = 0;
    std::string m_strLoadingText = "Loading...";
    HICON m_hLoadingIcon = nullptr;
    bool m_bShowLoadingIcon = false;
    std::atomic<int> m_nItemCount{0};
    std::atomic<int> m_nItemTotal{0};
    HTREEITEM m_hLoadingItem = nullptr;
    HTREEITEM m_hItemToPopulate = nullptr;
};

// A progress bar after the loading item's label: a black frame, a red bar that grows with the reports.
template <class T> class CProgressFX : public T {
protected:
    void PreAnimation(HTREEITEM loadingItem) override {
        T::PreAnimation(loadingItem);
        CRect label;
        if (!this->GetItemRect(loadingItem, &label, true))
            label.SetRectEmpty();
        m_rcFrame = label;
        if (m_rcFrame.Height() > 16) {
            const int shrink = (m_rcFrame.Height() - 16) / 2;
            m_rcFrame.DeflateRect(0, shrink);
        }
        m_rcFrame.OffsetRect(m_rcFrame.Width() + 3, 0);
        m_rcBar = m_rcFrame;
        m_rcBar.DeflateRect(3, 3);
        m_rcBar.right = m_rcBar.left;
        m_rcFrame.right = m_rcFrame.left + 56;
        m_brFrame.Attach(::CreateSolidBrush(RGB(0, 0, 0)));
        m_brBar.Attach(::CreateSolidBrush(RGB(255, 0, 0)));
        m_nDrawnWidth = -1;
    }
    void DoAnimation(bool tick, int total, int count) override {
        T::DoAnimation(tick, total, count);
        if (tick || !m_brFrame.GetSafeHandle() || !m_brBar.GetSafeHandle())
            return;
        // Drawn again only when the bar grew or the tree painted its snapshot over it: a report for every
        // one of many thousand items would otherwise cost a drawing each, and drawing into another
        // thread's window is slow.
        const int width = orvex::tree::ProgressWidth(total, count);
        if (!this->TakeRepaint() && width == m_nDrawnWidth)
            return;
        m_nDrawnWidth = width;
        if (HDC dc = this->GetAnimationDC()) {
            ::FrameRect(dc, &m_rcFrame, m_brFrame);
            CRect bar = m_rcBar;
            bar.right = bar.left + width;
            ::FillRect(dc, &bar, m_brBar);
            this->ReleaseAnimationDC(dc);
        }
    }
    void PostAnimation() override {
        m_brFrame.DeleteObject();
        m_brBar.DeleteObject();
        T::PostAnimation();
    }

    CRect m_rcFrame, m_rcBar;
    CGdiObjectT<HBRUSH> m_brFrame, m_brBar;
    int m_nDrawnWidth = -1; // the bar's width on the screen; -1 before the first drawing
};

// An animated hourglass in the loading item's icon place, one step a timer tick, over the progress bar
// of T. The hourglass is an animated cursor of the module (not owned; SetHourglass).
template <class T> class CHourglassFX : public T {
public:
    static constexpr int kFrames = 10;
    void SetHourglass(HCURSOR cursor) { m_hHourglass = cursor; }

protected:
    void PreAnimation(HTREEITEM loadingItem) override {
        T::PreAnimation(loadingItem);
        m_nFrame = 0;
        m_bIcon = this->GetLoadingIconRect(loadingItem, m_rcIcon);
        m_brBackground.Attach(::CreateSolidBrush(this->GetEffectiveBkColor()));
    }
    void DoAnimation(bool tick, int total, int count) override {
        if (!tick) {
            T::DoAnimation(tick, total, count);
            return;
        }
        m_nFrame = (m_nFrame + 1) % kFrames;
        if (!m_bIcon || !m_hHourglass)
            return;
        if (HDC dc = this->GetAnimationDC()) {
            ::DrawIconEx(dc, m_rcIcon.left, m_rcIcon.top, m_hHourglass, m_rcIcon.Width(), m_rcIcon.Height(),
                         static_cast<UINT>(m_nFrame), m_brBackground, DI_NORMAL);
            this->ReleaseAnimationDC(dc);
        }
    }
    void PostAnimation() override {
        m_brBackground.DeleteObject();
        T::PostAnimation();
    }

    CGdiObjectT<HBRUSH> m_brBackground;
    CRect m_rcIcon;
    bool m_bIcon = false;
    int m_nFrame = 0;
    HCURSOR m_hHourglass = nullptr;
};
