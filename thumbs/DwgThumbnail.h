// One drawing of the grid: a bordered child window in which the host draws the drawing's preview, a
// one-line label under it (the file name, also the in-place rename field) and a tooltip with the name,
// size and date. The grid re-creates these as rows scroll into view, so a control is bound to a list
// index only between its creation and its destruction; the selection lives in the record.
//
// Ownership: the grid's pool owns the controls; a control owns its label (a sibling window, child of the
// grid view) and its tooltip, and DestroyWindow takes both down. A control reaches the grid (and through
// it the document and the frame) through the view it was created in.
#pragma once

#include "framework/afxwin.h"
#include "framework/afxbars.h" // CToolTipCtrl

#include <string>

class CTessel3View;

// The label: a read-only edit that becomes the rename field.
class CThumbLabel : public CEdit {
public:
    bool IsRenaming() const { return m_bRenaming; }
    // Makes the label writable with the whole name selected; Enter commits, Escape or leaving restores.
    void BeginRename();
    // The rectangle of the sunken edge shown while renaming, in the grid view's client coordinates.
    CRect EdgeRect() const;

    bool PreTranslateMessage(MSG* pMsg) override;

protected:
    void OnLButtonDblClk(UINT flags, CPoint pt) override;
    void OnKeyDown(UINT nChar, UINT repeat, UINT flags) override;
    void OnChar(UINT nChar, UINT repeat, UINT flags) override;
    void OnKillFocus(HWND newWnd) override;

private:
    friend class exCDwgThumbnail;
    void OnReturn();
    void OnEscape();
    void OnLeave();
    // False when the label went while the file was renamed (the grid re-created its controls).
    bool Commit();
    void RedrawEdge();

    bool m_bRenaming = false;
    std::string m_strSaved; // the name before the rename began
    class exCDwgThumbnail* m_pOwner = nullptr;
};

class exCDwgThumbnail : public CWnd {
public:
    exCDwgThumbnail() = default;
    ~exCDwgThumbnail() override;

    bool Create(const std::string& name, int listIndex, const char* windowName, DWORD style, const RECT& cell,
                CTessel3View* parentView, UINT id);
    // Shows another drawing in the existing windows, moved to another cell: what destroying the control
    // and creating it anew would show, at a fraction of the cost. False (nothing changed) when the control
    // has no window or its label is being renamed.
    bool Rebind(const std::string& name, int listIndex, const RECT& cell);
    bool DestroyWindow() override;
    bool PreTranslateMessage(MSG* pMsg) override;
    // Drops the label's highlight and the record's selection.
    void Unselect();
    // Highlights the label when the record is selected (after the selection changed elsewhere).
    void ShowSelection();
    int ListIndex() const { return m_nListIndex; }
    const std::string& Name() const { return m_strName; }
    CThumbLabel& Label() { return m_wndLabel; }
    // The tooltip; its window exists once the mouse has moved over the picture.
    CToolTipCtrl& ToolTip() { return m_wndToolTip; }
    // The tooltip's text as it was built at creation.
    const std::string& ToolTipText() const { return m_strToolTip; }
    bool ToolTipActive() const { return m_bToolTipActive; }

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    void OnPaint() override;

private:
    friend class CThumbLabel;
    bool CreateLabel(const std::string& name, const RECT& cell);
    static CRect LabelRect(const RECT& cell);
    void CreateToolTip();
    // The mouse and key table of PreTranslateMessage; true when the message was consumed.
    bool TranslateInput(MSG* pMsg);
    // Marks this drawing selected and current; clearOthers first drops every other selection.
    void SelectThis(bool clearOthers);
    void ToggleSelection();
    void Pick();
    void ShowContextMenu(POINT screenPoint);
    void OnContextCommand(int command);
    void ShowProperties();
    void HighlightLabel();
    void DropLabelHighlight();

    CTessel3View* m_pView = nullptr; // the grid that created the window, while it exists
    std::string m_strName;           // the file name shown
    CThumbLabel m_wndLabel;
    int m_nListIndex = -1;
    CToolTipCtrl m_wndToolTip;
    std::string m_strToolTip;
    int m_nToolTipWidth = 0;
    bool m_bToolTipActive = false;
};

// The current directory, and the same with a "\" at its end.
std::string CurrentFolder();
std::string CurrentFolderWithSlash();

// Loads the thumbnail's context menu into menu and returns its popup (not owned), prepared: "&Paste"
// greyed unless canPaste (the clipboard holds drawings), sortMode (0 name, 1 date, 2 size) checked. Empty
// when the menu resource is missing.
CMenu BuildThumbnailMenu(CMenu& menu, int sortMode, bool canPaste);
