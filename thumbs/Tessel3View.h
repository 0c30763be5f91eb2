// The thumbnail grid: the right pane of the explorer frame. It lays the drawings of DwgList out in equal
// cells, keeps a ring of thumbnail controls for the visible rows plus two, and scrolls row by row over a
// scroll range capped at 32768 pixels. Reached module-wide through g_pTessel3View.
#pragma once

#include "framework/afxview.h"
#include "framework/CArray.h"
#include "thumbs/DwgThumbnail.h"

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

    int GetPictureWidth() const { return m_nCellWidth; }
    int GetPictureHeight() const { return m_nCellHeight; }
    int GetColumns() const { return m_nColumns; }
    int GetFirstRow() const { return m_nFirstRow; }

    // Height of a thumbnail's label, measured once from the view's font.
    static int LabelHeight();

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    bool PreTranslateMessage(MSG* pMsg) override;
    void OnDraw(CDC* pDC) override;
    void OnInitialUpdate() override;
    bool OnScroll(UINT scrollCode, UINT pos, bool doScroll) override;

private:
    void Layout();
    void Refit(bool resizeFrame);
    void Relayout();
    void CreateRow(int row, RECT& cell);
    void LineUp();
    void LineDown();

    POINT m_ptOrigin{0, 0};
    int m_nCellHeight = 143;
    int m_nCellWidth = 173;
    int m_nGap = 5;
    int m_nPoolRows = 11;
    int m_nFirstRow = 0;
    int m_nColumns = 60;
    int m_nOldColumns = 60;
    int m_nCount = 0;
    int m_nRows = 0;
    int m_nVisibleRows = 0;
    bool m_bAligning = false;
    CArray<exCDwgThumbnail, exCDwgThumbnail&> m_pool;
};

extern CTessel3View* g_pTessel3View;
