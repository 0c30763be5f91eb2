// The right pane is the thumbnail grid of thumbs/.
#include "frame/GridLink.h"

#include "thumbs/Tessel3View.h"
#include "thumbs/ThumbSearch.h"

CView* NewGridView() {
    return new CTessel3View;
}

CWnd* GridViewWindow() {
    return g_pTessel3View && g_pTessel3View->m_hWnd ? g_pTessel3View : nullptr;
}

CTessel3View* GridView() {
    return g_pTessel3View;
}

void RebuildGrid() {
    if (g_pTessel3View && g_pTessel3View->m_hWnd)
        g_pTessel3View->Rebuild();
}

void GridPictureSize(int& width, int& height) {
    width = g_pTessel3View ? g_pTessel3View->GetPictureWidth() : 0;
    height = g_pTessel3View ? g_pTessel3View->GetPictureHeight() : 0;
}

void SearchDrawings(const std::string& text) {
    RunSearch(text);
}
