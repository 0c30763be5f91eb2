// The left pane of the explorer's splitter until the folder tree takes its place: an empty view that
// the frame makes. Giving it the focus gives it to its first child, the tree once there is one.
#pragma once

#include "framework/afxview.h"

class CLeftPaneView : public CView {
public:
    void FocusFolderTree() {
        if (!m_hWnd)
            return;
        HWND target = m_hWnd;
        if (HWND tree = ::GetWindow(target, GW_CHILD))
            target = tree;
        ::SetFocus(target);
    }
};
