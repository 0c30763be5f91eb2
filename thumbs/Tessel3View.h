// The thumbnail grid: the right pane of the explorer frame. It lays the drawings of DwgList out in equal
// cells, keeps a ring of thumbnail controls for the visible rows plus two, and scrolls row by row over a
// scroll range capped at 32768 pixels. Reached module-wide through g_pTessel3View.
//
// The controls always sit in client coordinates with the first row shown at the top; the scroll
// position only mirrors the row (it wraps round inside the capped range), and every row step moves the
// window contents by exactly one row pitch.
#pragma once

#include "framework/afxview.h"
#include "framework/CArray.h"
#include "thumbs/DwgThumbnail.h"
#include "thumbs/GridMath.h"

class CTessel3View : public CScrollView {
public:
    CTessel3View();
    ~CTessel3View() override;

    // After every scan of the current folder: title, status, then back to the first drawing, sorted.
    void Rebuild();
    // Back to the first drawing: columns recomputed, optionally sorted by the frame's sort mode.
    void ScrollToBegin(bool sort);
    // Brings record `index` into view (the search's hit).
    void ShowIndex(int index);
    // Clears every selection, records and live controls.
    void DeselectAll();
    // Marks every record selected (labels already shown keep their look).
    void SelectAll();
    void Increase();
    void Decrease();
    void Align();
    // Rescans the current folder and rebuilds, once the message being handled is done (a control that
    // asks for it is destroyed by the rebuild).
    void PostRefresh();

    int GetPictureWidth() const { return m_nCellWidth; }
    int GetPictureHeight() const { return m_nCellHeight; }
    int GetColumns() const { return m_nColumns; }
    int GetFirstRow() const { return m_nFirstRow; }
    int GetRows() const { return m_nRows; }
    int GetVisibleRows() const { return m_nVisibleRows; }
    int GetPoolRows() const { return m_nPoolRows; }
    int GetPoolSize() const { return m_pool.GetSize(); }
    // The pool's control in slot `slot` (a window only while its row is alive).
    exCDwgThumbnail& PoolControl(int slot) { return m_pool[slot]; }
    // The live control showing list index `index`, or nullptr.
    exCDwgThumbnail* ControlOf(int index);

    // Height of a thumbnail's label, measured once from the view's font.
    static int LabelHeight();

    bool PreTranslateMessage(MSG* pMsg) override;
    bool OnScroll(UINT scrollCode, UINT pos, bool doScroll = true) override;
    void OnInitialUpdate() override;

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    bool PreCreateWindow(CREATESTRUCTA& cs) override;
    void OnDraw(CDC* pDC) override;
    void OnSize(UINT type, int cx, int cy) override;
    void OnKeyDown(UINT nChar, UINT repeat, UINT flags) override;
    bool OnEraseBkgnd(CDC* pDC) override;
    void OnDestroy() override;
    bool OnCmdMsg(UINT id, int code) override;

private:
    grid::Geometry Geometry() const;
    void Layout();
    void Refit(bool resizeFrame);
    void Relayout();
    void CreateRow(int row, int rowTop);
    void LineUp();
    void LineDown();
    void ApplyLineStep(const grid::LineStep& step, const grid::ScrollState& before,
                       const grid::ScrollState& after, int direction);
    grid::ScrollState CurrentScrollState() const;
    void DestroyPool();
    void Refresh();
    bool HandleKey(UINT key);

    POINT m_ptOrigin{0, 0};
    int m_nCellHeight = grid::kDefaultCellHeight;
    int m_nCellWidth = grid::kDefaultCellWidth;
    int m_nGap = grid::kDefaultGap;
    int m_nPoolRows = grid::kDefaultPoolRows;
    int m_nFirstRow = 0;
    int m_nColumns = 60;
    int m_nOldColumns = 60;
    int m_nCount = 0;
    int m_nRows = 0;
    int m_nVisibleRows = 0;
    bool m_bAligning = false;
    int m_nTotalHeight = 0; // capped scroll height of the last layout
    CArray<exCDwgThumbnail, exCDwgThumbnail&> m_pool;
};

extern CTessel3View* g_pTessel3View;

// Posted to the grid view: rescan the current folder and rebuild.
constexpr UINT WM_THUMBS_REFRESH = WM_USER + 0x321;
