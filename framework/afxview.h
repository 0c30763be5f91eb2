// Views: the windows that show a document in a frame, and the scrolling view.
#pragma once

#include "afxframe.h"

class CView : public CWnd {
public:
    CDocument* GetDocument() const { return m_pDocument; }
    CFrameWnd* GetParentFrame() const { return AfxGetParentFrame(this); }

    // Creates the view as a pane (id AFX_IDW_PANE_FIRST...) of a frame or splitter. A view with
    // windows of its own overrides it; the pane stands when this returns true.
    virtual bool Create(const char* className, const char* windowName, DWORD style, const RECT& rect, CWnd* parent,
                UINT id, CCreateContext* context = nullptr);
    using CWnd::Create;

    virtual void OnInitialUpdate() { OnUpdate(nullptr, 0); }
    virtual void OnUpdate(CView* sender, LPARAM hint) { Invalidate(); }
    virtual void OnDraw(CDC* pDC) {}
    virtual void OnPrepareDC(CDC* pDC) {}
    // The frame made this view active (or another one): activate == (this == activated).
    virtual void OnActivateView(bool activate, CView* activated, CView* deactivated);

    CDocument* m_pDocument = nullptr;
    bool m_bAutoDelete = true;

protected:
    bool PreCreateWindow(CREATESTRUCTA& cs) override;
    void OnPaint() override;
    void OnSetFocus(HWND oldWnd) override;
    void OnLButtonDown(UINT flags, CPoint pt) override;
    void OnDestroy() override;
    void PostNcDestroy() override;
};

class CScrollView : public CView {
public:
    // Mapping mode (MM_TEXT only), total size, page and line steps (0: a tenth of the page / total).
    void SetScrollSizes(int mapMode, SIZE total, SIZE page = CSize(), SIZE line = CSize());
    CPoint GetScrollPosition() const;
    void ScrollToPosition(POINT pt);
    CSize GetTotalSize() const { return m_totalLog; }

    // A scroll request: code = MAKEWORD(horizontal code, vertical code), 0xFF for "none"; pos is the
    // thumb position for SB_THUMBTRACK / SB_THUMBPOSITION. Returns whether the view scrolled.
    virtual bool OnScroll(UINT code, UINT pos, bool doScroll = true);
    virtual bool OnScrollBy(CSize sizeScroll, bool doScroll = true);
    void OnPrepareDC(CDC* pDC) override;

protected:
    void OnSize(UINT type, int cx, int cy) override;
    void OnHScroll(UINT code, UINT pos, HWND scrollBar) override;
    void OnVScroll(UINT code, UINT pos, HWND scrollBar) override;
    bool OnMouseWheel(UINT flags, short delta, CPoint pt) override;
    void UpdateBars();
    int TrackPos(int bar) const;

    int m_nMapMode = MM_TEXT;
    CSize m_totalLog;
    CSize m_pageDev;
    CSize m_lineDev;
    int m_wheelRemainder = 0;
};
