// The thumbnail browser's requests to the explorer frame, through the frame's public operations.
#include "thumbs/ThumbsGlue.h"

#include "frame/MainFrame.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/Tessel3View.h"

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
