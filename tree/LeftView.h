// The explorer's left pane: a plain view whose only content is the shell folder tree, filling its client
// area. The tree the pane holds (CChildView) draws an hourglass and a progress bar while it fills a node.
#pragma once

#include "framework/afxview.h"
#include "tree/ShellTreeCtrl.h"

#include <functional>
#include <string>

// The explorer's folder tree: the shell tree with the hourglass and the progress bar. Escape in it
// cancels the call; Tab moves the focus to the grid.
class CChildView : public CHourglassFX<CProgressFX<CShellTreeCtrl>> {
public:
    CChildView();
    ~CChildView() override;

    std::function<void()> onFocusGrid; // set by the owner: Tab leaves the tree for the grid

    bool PreTranslateMessage(MSG* pMsg) override;

private:
    HCURSOR m_hHourglassCursor = nullptr; // the module's animated cursor, destroyed with the tree
};

class CLeftView : public CView {
public:
    CLeftView() = default;

    // The label path of the LISP call's start folder, or empty; when given it replaces the saved one.
    void SetStartShellPath(const std::string& labelPath) { m_strStartShellPath = labelPath; }
    // The tree, or nullptr when it could not be created.
    CChildView* GetTree() { return m_wndTree.m_hWnd ? &m_wndTree : nullptr; }

    // Creates the view, then the tree, rooted at the Desktop, and gives the document the label path the
    // tree is to walk along (the start folder's, or the saved one). A tree that cannot be created leaves
    // an empty pane; the frame still stands.
    bool Create(const char* className, const char* windowName, DWORD style, const RECT& rect, CWnd* parent,
                UINT id, CCreateContext* context = nullptr) override;

protected:
    void OnSize(UINT type, int cx, int cy) override;
    void OnSetFocus(HWND oldWnd) override;

private:
    CChildView m_wndTree;
    std::string m_strStartShellPath;
};
