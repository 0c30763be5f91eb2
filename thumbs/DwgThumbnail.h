// One drawing of the grid: a bordered child window in which the host draws the drawing's preview, a
// one-line label under it (the file name, also the in-place rename field) and a tooltip with the name,
// size and date. The grid re-creates these as rows scroll into view, so a control is bound to a list
// index only between its creation and its destruction; the selection lives in the record.
#pragma once

#include "framework/afxwin.h"
#include "framework/afxtooltip.h"

#include <string>

class CDwgThumbnail : public CWnd {
public:
    // Frame colour hooks: this program draws no coloured frames, so they do nothing.
    virtual void SetFrameColour(COLORREF) {}
    virtual COLORREF GetFrameColour() const { return 0; }

protected:
    std::string m_strName; // the file name shown
};

// The label: a read-only edit that becomes the rename field.
class CThumbLabel : public CEdit {
public:
    bool IsRenaming() const { return m_bRenaming; }
    void BeginRename();

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;

private:
    friend class exCDwgThumbnail;
    bool m_bRenaming = false;
    std::string m_strSaved;
    class exCDwgThumbnail* m_pOwner = nullptr;
};

class exCDwgThumbnail : public CDwgThumbnail {
public:
    exCDwgThumbnail() = default;
    ~exCDwgThumbnail() override;
    // The pool is a CArray of controls: an empty control can be made, copying is never done.
    exCDwgThumbnail(const exCDwgThumbnail&) : exCDwgThumbnail() {}
    exCDwgThumbnail& operator=(const exCDwgThumbnail&) { return *this; }

    bool Create(const std::string& name, int listIndex, const char* windowName, DWORD style, const RECT& cell,
                CWnd* parentView, UINT id);
    bool DestroyWindow() override;
    bool PreTranslateMessage(MSG* pMsg) override;
    void Unselect();
    int ListIndex() const { return m_nListIndex; }
    CThumbLabel& Label() { return m_wndLabel; }

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;

private:
    bool CreateLabel(const std::string& name, CWnd* parentView, const RECT& cell);
    void SelectThis(bool clearOthers);
    void ShowContextMenu(POINT screenPoint);

    unsigned char m_bNoFrameColour = 0;
    CThumbLabel m_wndLabel;
    CStatic m_wndUnused; // destroyed with the control, never created
    int m_nListIndex = -1;
    COLORREF m_savedColour = 0;
    CToolTipCtrl m_wndToolTip;
};
