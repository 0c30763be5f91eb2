// A static splitter of one row and two columns: two panes side by side, the bar between them dragged
// with the mouse (live: the panes follow the mouse).
#pragma once

#include "afxview.h"

class CSplitterWnd : public CWnd {
public:
    bool CreateStatic(CWnd* parent, int rows, int cols, DWORD style = WS_CHILD | WS_VISIBLE,
                      UINT id = AFX_IDW_PANE_FIRST);
    // Creates the view of one pane; the factory makes the object (heap, it deletes itself with its
    // window) and size.cx is the column's ideal width.
    bool CreateView(int row, int col, const std::function<CView*()>& factory, SIZE size,
                    CCreateContext* context);
    template <class TView> bool CreateView(int row, int col, SIZE size, CCreateContext* context) {
        return CreateView(
            row, col, [] { return static_cast<CView*>(new TView); }, size, context);
    }

    CWnd* GetPane(int row, int col) const;
    int IdFromRowCol(int row, int col) const { return static_cast<int>(AFX_IDW_PANE_FIRST) + row * 16 + col; }
    void GetColumnInfo(int col, int& cur, int& min) const;
    // ideal: the column's wished width (the first column's); min: below it the first column is not shown,
    // and the second column keeps at least that much (at most half the splitter).
    void SetColumnInfo(int col, int ideal, int min);
    int GetColumnCount() const { return m_nCols; }
    virtual void RecalcLayout();

    int m_cxSplitter = 6; // width of the bar

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    void OnSize(UINT type, int cx, int cy) override;
    void OnPaint() override;
    bool OnSetCursor(HWND wnd, UINT hitTest, UINT message) override;
    void OnLButtonDown(UINT flags, CPoint pt) override;
    void OnMouseMove(UINT flags, CPoint pt) override;
    void OnLButtonUp(UINT flags, CPoint pt) override;
    bool OnCommand(WPARAM wParam, LPARAM lParam) override;
    bool OnNotify(WPARAM wParam, LPARAM lParam, LRESULT* pResult) override;
    CRect BarRect() const;

private:
    struct ColInfo {
        int ideal = 0;
        int min = 0;
        int cur = 0;
    };
    int m_nRows = 1;
    int m_nCols = 2;
    ColInfo m_cols[2];
    bool m_bTracking = false;
    int m_trackOffset = 0;
};
