// One drawing of the grid: a bordered child window in which the host draws the drawing's preview, a
// one-line label under it (the file name, also the in-place rename field) and a tooltip with the name,
// size and date. The grid re-creates these as rows scroll into view, so a control is bound to a list
// index only between its creation and its destruction; the selection lives in the record.
//
// Ownership: the grid's pool owns the controls; a control owns its label (a sibling window on the same
// parent) and its tooltip, and DestroyWindow takes both down. A control knows its owner only as a
// ThumbnailOwner: it reads its drawing from the owner's folder and reports the user's gestures to it.
#pragma once

#include "framework/afxwin.h"
#include "framework/afxbars.h" // CToolTipCtrl
#include "preview/PictureQueue.h"
#include "thumbs/TooltipText.h"

#include <cstdint>
#include <string>

class DrawingFolder;
class PictureLoader;

// What the user did on a thumbnail, as its owner (the grid) hears it, and what the thumbnail asks of it.
// The owner decides what each gesture means for the selection, the chosen drawing and the files.
class ThumbnailOwner {
public:
    // The folder whose drawings the thumbnails show.
    virtual const DrawingFolder& Folder() const = 0;
    // A click on the picture (toggle: with Ctrl held).
    virtual void OnThumbnailClick(int index, bool toggle) = 0;
    // A double click on the picture: the drawing is picked.
    virtual void OnThumbnailPick(int index) = 0;
    // A right click on the picture, at a point on the screen.
    virtual void OnThumbnailMenu(int index, POINT screenPoint) = 0;
    // A key pressed on the picture: the keyboard belongs to the owner.
    virtual void OnThumbnailKey(WPARAM key, LPARAM data) = 0;
    // A mouse button went down on the picture: the keyboard moves to the owner.
    virtual void OnThumbnailMouseDown() = 0;
    // Enter in a label being renamed. Renamed: the file has its new name (the owner reads the folder
    // again once the message is done); anything else: the old name must come back.
    enum class RenameOutcome { Renamed, Refused };
    virtual RenameOutcome OnThumbnailRename(const std::string& oldName, const std::string& newName) = 0;
    // The loader of the pictures; nullptr: the host's preview operation draws on each paint.
    virtual PictureLoader* Pictures() = 0;
    // A thumbnail painted its loading state: the owner queues the reads of what the screen shows.
    virtual void OnThumbnailPictureMissing() = 0;

protected:
    ~ThumbnailOwner() = default;
};

// Height of a thumbnail's label, measured once from the system's font.
int ThumbnailLabelHeight();

// The background behind a thumbnail's picture (0x00BBGGRR), as the host's preview operation is asked
// to draw it.
constexpr std::uint32_t kThumbnailBackground = 0;

// The picture of drawing `index` of folder at a picture area of width x height.
PictureKey DrawingPictureKey(const DrawingFolder& folder, int index, int width, int height);

// The label: a read-only edit that becomes the rename field.
class CThumbLabel : public CEdit {
public:
    bool IsRenaming() const { return m_bRenaming; }
    // Makes the label writable with the whole name selected; Enter commits, Escape or leaving restores.
    void BeginRename();
    // The rectangle of the sunken edge shown while renaming, in the grid view's client coordinates.
    CRect EdgeRect() const;
    // The name as the label shows it while not renaming: whole when it fits, else its start and "...".
    std::wstring ShownText(HDC dc) const;

    bool PreTranslateMessage(MSG* pMsg) override;

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
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
    // Draws the label while it is not renaming: the start of the name (an edit would scroll a selected
    // one to its end, and two long names that differ at their start would look the same), cut with an
    // ellipsis when it does not fit, highlighted as a selection when the drawing is selected.
    void Draw(HDC dc);
    // The client area less the edit's margins: where the text goes.
    CRect TextRect() const;

    bool m_bRenaming = false;
    std::string m_strSaved; // the name before the rename began
    class exCDwgThumbnail* m_pOwner = nullptr;
};

class exCDwgThumbnail : public CWnd {
public:
    exCDwgThumbnail() = default;
    ~exCDwgThumbnail() override;

    // The picture at cell and its label below it, children of parent; owner hears what the user does.
    bool Create(const std::string& name, int listIndex, const char* windowName, DWORD style, const RECT& cell,
                CWnd* parent, ThumbnailOwner* owner, UINT id);
    // Shows another drawing in the existing windows, moved to another cell: what destroying the control
    // and creating it anew would show, at a fraction of the cost. False (nothing changed) when the control
    // has no window or its label is being renamed.
    bool Rebind(const std::string& name, int listIndex, const RECT& cell);
    bool DestroyWindow() override;
    bool PreTranslateMessage(MSG* pMsg) override;
    // Highlights the label when the drawing is selected, drops the highlight when it is not (after the
    // selection changed).
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
    bool CreateLabel(const std::string& name, const RECT& cell, CWnd* parent);
    static CRect LabelRect(const RECT& cell);
    void CreateToolTip();
    // The mouse and key table of PreTranslateMessage; true when the message was consumed.
    bool TranslateInput(MSG* pMsg);
    bool IsDrawingSelected() const;
    void HighlightLabel();
    void DropLabelHighlight();

    ThumbnailOwner* m_pOwner = nullptr; // the grid that created the window, while it exists
    std::string m_strName;              // the file name shown
    CThumbLabel m_wndLabel;
    int m_nListIndex = -1;
    CToolTipCtrl m_wndToolTip;
    std::string m_strToolTip;
    ThumbTooltip m_toolTip; // its lines, measured when the tooltip is made
    bool m_bToolTipActive = false;
};

// Loads the thumbnail's context menu into menu and returns its popup (not owned), prepared: "&Paste"
// greyed unless canPaste (the clipboard holds drawings), sortMode (0 name, 1 date, 2 size) checked. Empty
// when the menu resource is missing.
CMenu BuildThumbnailMenu(CMenu& menu, int sortMode, bool canPaste);
