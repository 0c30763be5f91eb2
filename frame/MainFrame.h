// The explorer frame: menu, top toolbar with the search edit and the layer label, bottom toolbar with
// the accept and cancel buttons, status bar, and a splitter with the folder pane on the left and the
// thumbnail grid on the right. One frame exists during one call of the LISP function.
//
// Wiring. The frame makes its two views (through the splitter, with the creation context that carries
// the document) and sets their handlers: the grid tells the frame about the pick, the title, the status
// and the folder; Tab in the grid focuses the folder pane; the search edit runs the grid's search; a right
// click on a folder of the tree opens its "&Folder settings" menu, whose dialog (settings/) tells the frame
// when the folder's datains.ini changed, so the layer label is read again.
//
// Ownership. The frame is created with new and deletes itself when its window is destroyed; its bars,
// labels, search edit and splitter are members, their windows children of the frame. The views delete
// themselves with their windows; the frame forgets them when it is destroyed.
#pragma once

#include "frame/ExplorerCall.h"
#include "framework/afxframe.h"
#include "framework/afxbars.h"
#include "framework/afxsplit.h"
#include "thumbs/Tessel3View.h" // GridFileCommands

#include <functional>
#include <string>

class CChildView;
class CLeftView;
class CTessel3Doc;
class DrawingFolder;

// The grid's file commands, carried out with the shell's file operations.
class ExplorerFileCommands : public GridFileCommands {
public:
    // The window the shell's confirmations belong to.
    void SetOwner(HWND owner) { m_owner = owner; }

    bool ClipboardHoldsDrawings() override;
    void Copy(const std::vector<std::string>& paths, bool cut) override;
    int Paste(const std::string& folder) override;
    int Delete(const std::vector<std::string>& paths) override;
    int Rename(const std::string& source, const std::string& destination) override;
    void ShowProperties(const std::string& path) override;

private:
    HWND m_owner = nullptr;
};

// The toolbar's search edit: every change of its text runs the search by name prefix.
class CEditSearch : public CEdit {
public:
    // Set by the frame: runs the search for the edit's new text.
    std::function<void(const std::string&)> onSearch;
    // Set by the frame: Enter takes the drawing the search chose, as the accept button does.
    std::function<void()> onAccept;

protected:
    bool OnCommandReflect(UINT code) override; // EN_CHANGE
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
};

// A toolbar edit without behaviour of its own.
class CEditEx : public CEdit {};

class CMainFrame : public CFrameWnd {
public:
    // folder: the folder model of the call, which outlives the frame; the frame is its owner's voice while
    // it stands (title, pick, grid, layer label).
    CMainFrame(const ExplorerCall& call, DrawingFolder& folder);
    ~CMainFrame() override;

    // Sort mode: 0 by name, 1 by date, 2 by size.
    int GetSortMode() const { return m_nSort; }

    // Enables or disables the pick: the bottom toolbar's accept button and its label.
    void EnablePick(bool enable);
    bool IsPickEnabled() const { return m_bPickEnabled; }

    // Sets the window text (the grid shows the current folder or the chosen drawing there).
    void SetTitleText(const std::string& text);

    // Re-reads the layer of the current folder's "datains.ini" into the top toolbar's label.
    void UpdateLayerLabel();

    // The grid view, nullptr before the frame has made it and once the frame is destroyed.
    CTessel3View* GetGridView() const { return m_pGridView; }
    // The folder tree, nullptr when the left pane has none.
    CChildView* GetFolderTree() const;
    CEditSearch& GetSearchEdit() { return m_wndSearch; }

    // The frame's parts, for the hosting code and its tests.
    CToolBar& GetMainToolBar() { return m_wndToolBar; }
    CToolBar& GetPickToolBar() { return m_wndToolBar2; }
    CStatusBar& GetStatusBar() { return m_wndStatusBar; }
    CSplitterWnd& GetSplitter() { return m_wndSplitter; }
    CStatic& GetSearchLabel() { return m_wndSearchLabel; }
    CStatic& GetLayerLabel() { return m_wndLayerLabel; }
    CStatic& GetAcceptLabel() { return m_wndAcceptLabel; }
    CStatic& GetCancelLabel() { return m_wndCancelLabel; }

    // The label font and the text size measured with it (what the toolbar labels are sized by).
    static HFONT LabelFont();
    CSize MeasureLabelText(const std::string& text);

    // The frame's accelerators, but for the keys an edit box uses on its text while one has the focus.
    bool PreTranslateMessage(MSG* pMsg) override;

    // The drawing of the last run, to be chosen again once the slow scan of the start folder has ended
    // (as the application object chooses it at once after a quick one): its name starts the search
    // (searchText) and it is selected. Only when the folder shown then is still folder.
    void ChooseAfterScan(const std::string& folder, const std::string& name, const std::string& searchText);

    // How many drawings the folder shown holds, once one is shown: the status bar comes back to it.
    std::string GetIdleMessage() const override;

protected:
    int OnCreate(LPCREATESTRUCTA cs) override;
    void OnDestroy() override;
    void OnTimer(UINT_PTR id) override;
    bool OnCreateClient(LPCREATESTRUCTA cs, CCreateContext* context) override;
    bool OnCmdMsg(UINT id, int code) override;
    bool OnUpdateCmdUI(CCmdUI* pCmdUI) override;
    void OnUpdateFrameTitle(bool addToTitle) override;

private:
    bool CreateMainToolBar();
    bool CreatePickToolBar();
    bool CreateToolBarLabel(CToolBar& bar, UINT placeholder, const std::string& text, int extraWidth,
                            CStatic& label);
    bool CreateSearchEdit();
    bool CreateCaptionLabel(CToolBar& bar, UINT button, const char* caption, CStatic& label);
    CView* MakeGridView();
    CView* MakeFolderPane();
    void WireFolderTree();
    void WireDrawingFolder();
    // What the folder model says changed.
    void OnFolderShown();
    void OnDrawingChosen();
    // While a slow scan goes on: its count in the status bar; its end shows the folder.
    void FollowScan();
    // The title for the folder shown: its path, or the explorer's name when it does not exist or cannot
    // be reached.
    std::string FolderTitle() const;
    // The folder tree's right-click menu, "&Folder settings", at a point of the screen, and the dialog it
    // opens. False when the node has no menu (a virtual folder).
    bool ShowFolderMenu(HTREEITEM item, CPoint at);
    bool ForwardToGrid(UINT id);
    void SetSortMode(int mode);
    void ShowHelp();
    void TellUser(const std::string& text);
    // The accept and cancel buttons take the keyboard: the bottom toolbar gets the focus with the button
    // shown hot; Tab, the arrows, Enter and Space act on it there.
    void FocusPickButton(UINT id);
    // F5: the folder shown is read again (drawings another program added or removed show).
    void RefreshFolder();
    // F6, Shift+F6: the keyboard goes from the tree to the grid or back.
    void SwitchPane();
    bool HandlePickBarKey(UINT vk, bool shift);
    void LeavePickBar();

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
    bool m_bPickEnabled = true;
    ExplorerCall m_call;
    DrawingFolder& m_folder;
    ExplorerFileCommands m_fileCommands;
    CTessel3Doc* m_pDoc = nullptr;       // of the creation context; outlives the frame
    CTessel3View* m_pGridView = nullptr; // the right pane
    CLeftView* m_pFolderPane = nullptr;  // the left pane
    std::string m_strIdleMessage;        // the status bar's resting text; empty: the framework's
    struct {
        std::string folder, name, searchText;
    } m_chooseAfterScan; // the last run's drawing while the start folder is being read
};

// The one command of the folder tree's right-click menu.
constexpr int kFolderMenuSettings = 1;

// Id of the bottom toolbar's window (the top one has the standard toolbar id).
constexpr UINT kPickToolBarId = AFX_IDW_TOOLBAR + 4;

// The product name that replaces "Untitled" in the window title.
extern const char* const kExplorerTitle;
// The caption of the explorer's message boxes.
extern const char* const kExplorerMessageCaption;

// Whether the key is one an edit box acts on its text with (select all, copy, cut, paste, undo, delete),
// given which of Ctrl, Shift and Alt are held.
bool IsEditingKey(UINT vk, bool ctrl, bool shift, bool alt);

// The window title with "Untitled" replaced by the product name.
std::string ExplorerTitle(const std::string& windowText);
// The help file: the module's own path with the extension "hlp".
std::string HelpFilePath();
// The layer label of a folder: " Layer name: " and the folder's datains.ini layer, or "Current".
std::string LayerLabelText(const std::string& folder);
// The status bar's count of the drawings a folder holds: "No drawings", "1 drawing", "12 drawings".
std::string DrawingCountText(int count);
// The status bar while a slow scan goes on: "Reading the folder… 12 drawings", the ellipsis as the
// names' code page writes it ("..." where it has none).
std::string ScanningText(int count);
// How often the status bar's count follows a slow scan, in milliseconds.
constexpr UINT kScanCountMs = 100;
