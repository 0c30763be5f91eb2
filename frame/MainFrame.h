// The explorer frame: menu, top toolbar with the search edit and the layer label, bottom toolbar with
// the accept and cancel buttons, status bar, and a splitter with the folder pane on the left and the
// thumbnail grid on the right. One frame exists during one call of the LISP function.
//
// What the rest of the explorer may call is the public part below; the grid view, the thumbnails and
// the search edit reach the frame through g_pMainFrame (null when there is none).
#pragma once

#include "framework/afxframe.h"
#include "framework/afxbars.h"
#include "framework/afxsplit.h"

#include <string>

class CTessel3View;

// The toolbar's search edit: every change of its text runs the search by name prefix.
class CEditSearch : public CEdit {
protected:
    bool OnCommandReflect(UINT code) override; // EN_CHANGE
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
};

// A toolbar edit without behaviour of its own.
class CEditEx : public CEdit {};

class CMainFrame : public CFrameWnd {
public:
    CMainFrame();
    ~CMainFrame() override;

    // Sort mode: 0 by name, 1 by date, 2 by size.
    int GetSortMode() const { return m_nSort; }

    // Enables or disables the pick: the bottom toolbar's accept button and its label.
    void EnablePick(bool enable);

    // Sets the window text (the grid shows the current folder or the chosen drawing there).
    void SetTitleText(const std::string& text);

    // Re-reads the layer of the current folder's "datains.ini" into the top toolbar's label.
    void UpdateLayerLabel();

    // Posts the accept (1) or cancel (2) message to the application's main window (the run dialog).
    static void PostResult(int result);

    CTessel3View* GetGridView() const;
    CEditSearch& GetSearchEdit() { return m_wndSearch; }

protected:
    int OnCreate(LPCREATESTRUCTA cs) override;
    void OnDestroy() override;
    bool OnCreateClient(LPCREATESTRUCTA cs, CCreateContext* context) override;
    bool OnCmdMsg(UINT id, int code) override;
    bool OnUpdateCmdUI(CCmdUI* pCmdUI) override;
    bool PreTranslateMessage(MSG* pMsg) override;
    void OnUpdateFrameTitle(bool addToTitle) override;

private:
    CSplitterWnd m_wndSplitter;
    CEditSearch m_wndSearch;
    CStatic m_wndSearchLabel;
    CStatic m_wndLayerLabel;
    CStatic m_wndAcceptLabel;
    CStatic m_wndCancelLabel;
    CStatusBar m_wndStatusBar;
    CToolBar m_wndToolBar;
    CToolBar m_wndToolBar2;
    int m_nSort = 0;
};

extern CMainFrame* g_pMainFrame;
