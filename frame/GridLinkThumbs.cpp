// The right pane is the thumbnail grid of thumbs/, and the frame answers the grid's requests
// (thumbs/ThumbsGlue.h). Both live in this one file, which the frame always links (it makes the grid),
// so the grid's calls back into the frame are resolved with it.
#include "frame/GridLink.h"

#include "frame/MainFrame.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/Tessel3View.h"
#include "thumbs/ThumbSearch.h"
#include "thumbs/ThumbsGlue.h"

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

void ChooseSavedDrawing(const std::string& name) {
    ChooseDrawing(name);
}

// ---- what the grid asks of the frame ----

int FrameSortMode() {
    if (g_pMainFrame)
        return g_pMainFrame->GetSortMode();
    return g_pTessel3Doc ? g_pTessel3Doc->m_nSort : 0;
}

void FrameEnablePick(bool enable) {
    if (g_pMainFrame)
        g_pMainFrame->EnablePick(enable);
}

void FrameSetTitle(const std::string& text) {
    if (g_pMainFrame)
        g_pMainFrame->SetTitleText(text);
}

void FrameUpdateStatus() {
    if (g_pMainFrame)
        g_pMainFrame->UpdateLayerLabel();
}

void FrameSetStatusText(const std::string& text) {
    if (g_pMainFrame && g_pMainFrame->m_hWnd)
        g_pMainFrame->SetMessageText(text);
}

void FrameTellUser(const std::string& text) {
    HWND owner = g_pMainFrame ? g_pMainFrame->m_hWnd : nullptr;
    ::MessageBoxA(owner, text.c_str(), kExplorerMessageCaption, MB_OK | MB_ICONWARNING);
}

void FrameFocusFolderTree() {
    // The folder pane is the splitter's first column, beside the grid.
    if (!g_pTessel3View)
        return;
    auto* splitter = dynamic_cast<CSplitterWnd*>(g_pTessel3View->GetParent());
    CWnd* pane = splitter ? splitter->GetPane(0, 0) : nullptr;
    if (!pane || !pane->m_hWnd)
        return;
    HWND target = pane->m_hWnd;
    if (HWND tree = ::GetWindow(target, GW_CHILD))
        target = tree;
    ::SetFocus(target);
}

HWND FrameWindow() {
    return g_pMainFrame ? g_pMainFrame->m_hWnd : nullptr;
}
