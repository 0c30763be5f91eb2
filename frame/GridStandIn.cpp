// The right pane while the thumbnail grid is not part of the build: an empty view.
#include "frame/GridLink.h"

#include "framework/afxview.h"

namespace {

class CEmptyGridPane : public CView {
public:
    CEmptyGridPane() { s_pane = this; }
    ~CEmptyGridPane() override {
        if (s_pane == this)
            s_pane = nullptr;
    }
    static CEmptyGridPane* s_pane;
};

CEmptyGridPane* CEmptyGridPane::s_pane = nullptr;

} // namespace

CView* NewGridView() {
    return new CEmptyGridPane;
}

CWnd* GridViewWindow() {
    return CEmptyGridPane::s_pane && CEmptyGridPane::s_pane->m_hWnd ? CEmptyGridPane::s_pane : nullptr;
}

CTessel3View* GridView() {
    return nullptr;
}

void RebuildGrid() {}

void GridPictureSize(int& width, int& height) {
    width = 0;
    height = 0;
}

void SearchDrawings(const std::string&) {}

void ChooseSavedDrawing(const std::string&) {}
