// The thumbnail grid: the right pane of the explorer frame. It lays the drawings of DwgList out in equal
// cells, keeps a ring of thumbnail controls for the visible rows plus two, and scrolls row by row over a
// scroll range capped at 32768 pixels.
//
// The owner (the frame) creates the view with a context that holds the document, hands it the folder
// model (SetFolder) and the file commands, and sets the on... handlers through which the grid tells it
// what only the frame can do; a handler left empty is simply not called. The chosen drawing, the title
// and the pick follow from the folder model, whose owner hears its changes. The thumbnails report what
// the user does to the grid, their ThumbnailOwner.
//
// The controls sit on a sheet, a child window that covers the client area and a margin of rows above
// and below it, with the first row shown at the top of the client area; the vertical scroll position only
// shows where the first row lies, in proportion between the top and the last page (one position may stand
// for many rows), and every row step moves the window contents by exactly one row pitch: the sheet moves,
// and the controls on it with it. A thumb dragged or let go takes the grid to its row; a click in the
// trough moves a page.
#pragma once

#include "framework/afxview.h"
#include "thumbs/DwgThumbnail.h"
#include "thumbs/FileCommandText.h"
#include "thumbs/GridMath.h"

#include <functional>
#include <memory>
#include <string>
#include <vector>

class CTessel3Doc;
class PictureLoader;
class CTessel3View;
class DrawingFolder;

// What a file command returns when nothing was done on purpose (the user said no, nothing to do); 0 is
// done, anything else the system's error.
constexpr int kFileCommandNotDone = -1;

// The file commands the grid offers in its menus and keys, carried out by its owner's file operations.
// Paths are full; the folder is the one shown.
class GridFileCommands {
public:
    // Whether Paste is offered: the clipboard's file list names a drawing.
    virtual bool ClipboardHoldsDrawings() = 0;
    // Puts the drawings on the clipboard (cut: the next paste moves them).
    virtual void Copy(const std::vector<std::string>& paths, bool cut) = 0;
    // Pastes the clipboard's files into folder.
    virtual int Paste(const std::string& folder) = 0;
    // Sends the drawings to the Recycle Bin, the shell confirming.
    virtual int Delete(const std::vector<std::string>& paths) = 0;
    // Renames a file.
    virtual int Rename(const std::string& source, const std::string& destination) = 0;
    // The shell's property sheet of a file.
    virtual void ShowProperties(const std::string& path) = 0;

protected:
    ~GridFileCommands() = default;
};

// The sheet under the thumbnails and their labels. Scrolling a window moves each of its children, one
// round trip to the window system apiece; with the controls on one sheet a row step moves one window, and
// only the row that left is moved, to the other edge. The sheet is taller than the view by a margin above
// and below; when a step has used the margin up, the sheet moves back and its controls the other way,
// which changes nothing on the screen. The sheet paints the grid's background and the edge of a label
// being renamed; the mouse goes through it to the view.
class CGridSheet : public CWnd {
public:
    explicit CGridSheet(CTessel3View& view) : m_view(view) {}

protected:
    bool PreCreateWindow(CREATESTRUCTA& cs) override;
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;

private:
    CTessel3View& m_view;
};

// The numbers of the grid's own context menu (built at run time).
enum GridMenuCommand { kGridMenuCopy = 1, kGridMenuPaste = 2, kGridMenuDelete = 3, kGridMenuRename = 4 };

class CTessel3View : public CScrollView, private ThumbnailOwner {
public:
    CTessel3View();
    ~CTessel3View() override;

    // Set by the owner when it creates the view.
    std::function<int()> onSortMode;                      // 0 by name, 1 by date, 2 by size
    std::function<void(int mode)> onSort;                 // a sort chosen in a thumbnail's menu
    std::function<void(const std::string&)> onStatusText; // the status bar's message (empty clears)
    std::function<void(const std::string&)> onTellUser;   // something the user must read
    std::function<void()> onFocusFolderTree;              // Shift+Tab leaves the grid for the folder tree
    std::function<void()> onFocusPickButtons;             // Tab leaves the grid for accept and cancel
    // Align: the frame grows (or shrinks) by so many pixels, to hold whole columns and rows.
    std::function<void(int widthChange, int heightChange)> onGrowFrame;

    // The folder whose drawings the grid shows (not owned; it outlives the view). Set before the view
    // lays anything out.
    void SetFolder(DrawingFolder* folder) { m_pFolder = folder; }
    DrawingFolder* GetFolder() const { return m_pFolder; }
    // The file commands (not owned); without them the menus offer nothing and rename refuses.
    void SetFileCommands(GridFileCommands* commands) { m_pFileCommands = commands; }

    // The document of the creation context (the explorer's settings), or nullptr.
    CTessel3Doc* Document() const;
    // What the grid tells the owner, through the handlers above.
    int SortMode() const;
    void SetStatusText(const std::string& text);
    void TellUser(const std::string& text);

    // After every scan of the folder: back to the first drawing, sorted.
    void Rebuild();
    // Back to the first drawing: columns recomputed, optionally sorted by the frame's sort mode.
    void ScrollToBegin(bool sort);
    // Brings record `index` into view (the search's hit).
    void ShowIndex(int index);
    // Clears every selection, records and live controls.
    void DeselectAll();
    // Marks every drawing selected, and every label shows it.
    void SelectAll();
    // Enter and Ctrl+O: the chosen drawing is taken (the accept button's pick); nothing when none is.
    void TakeChosen();
    void Increase();
    void Decrease();
    void Align();
    // Reads the folder again, once the message being handled is done (a control that asks for it is
    // destroyed by the rebuild that follows).
    void PostRefresh();

    // The file commands, as the menus and keys of the grid and its thumbnails run them. Those that change
    // the folder refresh it afterwards. The shell's own loops run inside them: a thumbnail that calls one
    // looks itself up again before it goes on.
    bool ClipboardHoldsDrawings() const;
    bool AnySelected() const;
    void CopySelection(bool cut);
    void PasteFiles();
    void DeleteSelection();
    // Renames a drawing of the folder after checking the new name; a refusal is told to the user.
    ThumbnailOwner::RenameOutcome RenameDrawing(const std::string& oldName, const std::string& newName);
    void ShowProperties(int index);
    // The grid's own context menu at a screen point: "&Copy" 1, "&Delete" 3, "&Paste" 2, "&Rename" 4
    // (always greyed), in that order. Returns the number chosen (0 when dismissed) after running it.
    int RunContextMenu(POINT screenPoint);

    // The search edit's search as you type: finds the first drawing whose name starts with text (case
    // ignored; a whole name matches too), clears every other selection, brings the match into view
    // selected and makes it the current drawing with the title to match and the pick enabled. Without a
    // match nothing is selected or current, the pick is disabled, the title shows the folder and the
    // status bar says that no drawing starts with the text. An empty text or an empty list changes
    // nothing but the status message. The window that had the focus keeps it.
    void RunSearch(const std::string& text);
    // Makes the drawing of that name (case ignored) the chosen one, as a search hit would; false when the
    // list has no such drawing. The explorer chooses the drawing of the last run this way.
    bool ChooseDrawing(const std::string& name);

    int GetPictureWidth() const { return m_nCellWidth; }
    int GetPictureHeight() const { return m_nCellHeight; }
    int GetColumns() const { return m_nColumns; }
    int GetFirstRow() const { return m_nFirstRow; }
    int GetRows() const { return m_nRows; }
    int GetVisibleRows() const { return m_nVisibleRows; }
    int GetPoolRows() const { return m_nPoolRows; }
    int GetPoolSize() const { return static_cast<int>(m_pool.size()); }
    // The live control showing list index `index`, or nullptr.
    exCDwgThumbnail* ControlOf(int index);

    // Height of a thumbnail's label, measured once from the system's font.
    static int LabelHeight() { return ThumbnailLabelHeight(); }
    // The window the thumbnails and labels are children of (see CGridSheet); the view itself until its
    // first layout has made the sheet.
    CWnd* Sheet() { return m_wndSheet.m_hWnd ? static_cast<CWnd*>(&m_wndSheet) : this; }
    // The sheet's top-left corner in the view's client coordinates.
    CPoint SheetOrigin() const;
    // Draws the grid's background and the edge of a label being renamed, in the sheet's coordinates.
    void DrawSheet(CDC& dc);

    bool PreTranslateMessage(MSG* pMsg) override;
    bool OnScroll(UINT scrollCode, UINT pos, bool doScroll = true) override;
    bool OnScrollBy(CSize sizeScroll, bool doScroll = true) override;
    void OnInitialUpdate() override;

protected:
    int OnCreate(LPCREATESTRUCTA cs) override;
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
    bool PreCreateWindow(CREATESTRUCTA& cs) override;
    void OnDraw(CDC* pDC) override;
    void OnSize(UINT type, int cx, int cy) override;
    void OnKeyDown(UINT nChar, UINT repeat, UINT flags) override;
    void OnRButtonDown(UINT flags, CPoint pt) override;
    void OnLButtonDown(UINT flags, CPoint pt) override;
    bool OnEraseBkgnd(CDC* pDC) override;
    void OnDestroy() override;
    bool OnCmdMsg(UINT id, int code) override;

private:
    // What the thumbnails report (ThumbnailOwner).
    const DrawingFolder& Folder() const override;
    void OnThumbnailClick(int index, bool toggle) override;
    void OnThumbnailPick(int index) override;
    void OnThumbnailMenu(int index, POINT screenPoint) override;
    void OnThumbnailKey(WPARAM key, LPARAM data) override;
    void OnThumbnailMouseDown() override;
    RenameOutcome OnThumbnailRename(const std::string& oldName, const std::string& newName) override;
    PictureLoader* Pictures() override { return m_pictures.get(); }
    void OnThumbnailPictureMissing() override { SchedulePictures(); }
    // Asks for QueuePictures once the message being handled is done (WM_ORVEX_PICTURES).
    void SchedulePictures();
    // Tells the loader which pictures the screen wants now: the visible cells, then one screen ahead.
    void QueuePictures();
    // A picture arrived: the controls that show that drawing repaint.
    void OnPictureReady(const PictureKey& key);
    void RunThumbnailCommand(int index, int command);
    void TakeFocusFromElsewhere();
    // After a file command: the folder is read again; a failure is said (names: the drawings it was for).
    void AfterFileCommand(int result, FileCommand command, const std::string& subject,
                          const std::vector<std::string>& names);
    // Makes the drawing selected and chosen; clearOthers first drops every other selection.
    void SelectAndChoose(int index, bool clearOthers);
    int DrawingCount() const;

    grid::Geometry Geometry() const;
    void Layout();
    void Refit(bool resizeFrame);
    void Relayout();
    CSize FrameRoom() const;
    void CreateRow(int row, int rowTop);
    // Binds or creates the windows of a row's cells (onlyMissing: only of cells whose control has none).
    void PlaceRow(int row, int rowTop, bool onlyMissing);
    // The pool rows Layout left for later (wholly below the client area), made once the grid has drawn.
    void CreatePendingRows();
    // Creates the sheet, or places it afresh: a margin above and below the client area.
    void PlaceSheet();
    // Moves the sheet back when a step has left part of the client area uncovered.
    void KeepSheetCovering();
    int SheetMargin() const;
    void LineUp();
    void LineDown();
    void PageUp();
    void PageDown();
    // The first row of the last page, and the scroll bar's largest position: the two ends the thumb maps.
    int LastFirstRow() const;
    int BarMaxPos() const;
    void ApplyLineStep(const grid::LineStep& step, const grid::ScrollState& before,
                       const grid::ScrollState& after, int direction);
    grid::ScrollState CurrentScrollState() const;
    void DestroyPool();
    void Refresh();
    bool HandleKey(UINT key);
    void ShowChosen(int index);
    void ShowNothingChosen(const std::string& text);
    int PoolSize() const { return static_cast<int>(m_pool.size()); }
    // The pool's control in slot `slot` (a window only while its row is alive).
    exCDwgThumbnail& PoolControl(int slot) { return *m_pool[static_cast<std::size_t>(slot)]; }

    POINT m_ptOrigin{0, 0};
    int m_nCellHeight = grid::kDefaultCellHeight;
    int m_nCellWidth = grid::kDefaultCellWidth;
    int m_nGap = grid::kDefaultGap;
    int m_nPoolRows = grid::kDefaultPoolRows;
    int m_nFirstRow = 0;
    int m_nColumns = 60;
    int m_nOldColumns = 60;
    int m_nCount = 0;
    int m_nRows = 0;
    int m_nVisibleRows = 0;
    bool m_bAligning = false;
    DrawingFolder* m_pFolder = nullptr;
    GridFileCommands* m_pFileCommands = nullptr;
    bool m_bRowsPending = false; // WM_ORVEX_MORE_ROWS is posted and not handled yet
    int m_nTotalHeight = 0;      // capped scroll height of the last layout
    int m_nTotalWidth = 0;       // width of the grid's columns in the last layout
    CGridSheet m_wndSheet{*this};
    // The controls live on the heap: resizing the pool never moves or copies a live window.
    std::vector<std::unique_ptr<exCDwgThumbnail>> m_pool;
    // The pictures, read and decoded off this thread; made with the window, ended with it (after the
    // pool, whose controls paint from it).
    std::unique_ptr<PictureLoader> m_pictures;
    bool m_bPicturesPending = false; // WM_ORVEX_PICTURES is posted and not handled yet
    int m_nQueuedFirstRow = 0;       // the first row when the pictures were last queued
    int m_nScrollDirection = 1;      // of the last scroll: 1 down, -1 up
};
