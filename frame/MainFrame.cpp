#include "frame/MainFrame.h"

#include "frame/AboutDlgArx.h"
#include "fileops/ForFileCommands.h"
#include "hostapi/NarrowText.h"
#include "settings/DialogSetLa.h"
#include "settings/FolderSettings.h"
#include "settings/IniFile.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "thumbs/Tessel3View.h"
#include "tree/LeftView.h"

#include "res/resource.h"

#include <shellapi.h>

#include <algorithm>
#include <cstdlib>
#include <iterator>

const char* const kExplorerTitle = "Kelmar Dwg Thumbnail Explorer";
const char* const kExplorerMessageCaption = "Drawing explorer";

namespace {

const UINT kIndicators[] = {ID_SEPARATOR, ID_INDICATOR_CAPS, ID_INDICATOR_NUM, ID_INDICATOR_SCRL};

// The frame's timer that follows a slow scan.
constexpr UINT_PTR kTimerScan = 1;

constexpr int kSearchEditWidth = 125;
constexpr int kLayerLabelExtra = 1000;
// The grid keeps at least this width (half the frame when it is narrower) however wide the stored tree
// pane: a width saved in a maximised frame would otherwise leave no grid in a smaller one.
constexpr int kMinGridWidth = 200;
constexpr UINT kLabelStyle = WS_CHILD | WS_VISIBLE | SS_LEFT | SS_CENTERIMAGE | SS_NOPREFIX;

// The commands the grid carries out; the frame passes them on.
const UINT kGridCommands[] = {ID_VIEW_BEGIN, ID_VIEW_INCREASE, ID_VIEW_DECREASE, ID_VIEW_ALIGNE, ID_FILE_OPEN,
                              ID_EDIT_COPY,  ID_EDIT_CUT,      ID_EDIT_PASTE,    ID_SELECT_ALL};

bool IsGridCommand(UINT id) {
    return std::find(std::begin(kGridCommands), std::end(kGridCommands), id) != std::end(kGridCommands);
}

// The sort mode a sort command sets, or -1.
int SortModeOf(UINT id) {
    switch (id) {
    case ID_SORT_NAME:
        return 0;
    case ID_SORT_DATE:
        return 1;
    case ID_SORT_SIZE:
        return 2;
    default:
        return -1;
    }
}

} // namespace

bool IsEditingKey(UINT vk, bool ctrl, bool shift, bool alt) {
    if (ctrl && !alt && !shift)
        return vk == 'A' || vk == 'C' || vk == 'X' || vk == 'V' || vk == 'Z' || vk == VK_INSERT;
    if (shift && !ctrl && !alt)
        return vk == VK_INSERT || vk == VK_DELETE;
    if (alt && !ctrl && !shift)
        return vk == VK_BACK;
    return !ctrl && !shift && !alt && vk == VK_DELETE;
}

namespace {

bool IsHeld(int vk) {
    return (::GetKeyState(vk) & 0x8000) != 0;
}

// An edit box that takes typing: the search edit, a label being renamed.
bool IsWritableEdit(HWND window) {
    char name[16] = "";
    return window && ::GetClassNameA(window, name, sizeof name) && ::lstrcmpiA(name, "Edit") == 0 &&
           !(::GetWindowLongPtrA(window, GWL_STYLE) & ES_READONLY);
}

} // namespace

bool CMainFrame::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message == WM_KEYDOWN && m_wndToolBar2.m_hWnd && ::GetFocus() == m_wndToolBar2.m_hWnd &&
        !IsHeld(VK_CONTROL) && !IsHeld(VK_MENU) &&
        HandlePickBarKey(static_cast<UINT>(pMsg->wParam), IsHeld(VK_SHIFT)))
        return true;
    // In an edit box Ctrl+A selects its text, Ctrl+V pastes text into it, and so on, as in every edit box:
    // those keys must not reach the drawings (select all, copy, paste files into the folder).
    if ((pMsg->message == WM_KEYDOWN || pMsg->message == WM_SYSKEYDOWN) && IsWritableEdit(::GetFocus()) &&
        IsEditingKey(static_cast<UINT>(pMsg->wParam), IsHeld(VK_CONTROL), IsHeld(VK_SHIFT), IsHeld(VK_MENU)))
        return false;
    return CFrameWnd::PreTranslateMessage(pMsg);
}

std::string ExplorerTitle(const std::string& windowText) {
    static const std::string untitled = "Untitled";
    std::string text = windowText;
    const auto at = text.find(untitled);
    if (at != std::string::npos)
        text.replace(at, untitled.size(), kExplorerTitle);
    return text;
}

std::string HelpFilePath() {
    char module[MAX_PATH] = "";
    const DWORD n = ::GetModuleFileNameA(AfxGetInstanceHandle(), module, MAX_PATH);
    std::string path(module, n < MAX_PATH ? n : 0);
    // The extension after the last dot of the file name, not of a folder.
    const auto dot = path.rfind('.');
    const auto separator = LastSeparator(path);
    if (dot != std::string::npos && (separator == std::string::npos || dot > separator))
        path.erase(dot);
    return path + ".hlp";
}

std::string DrawingCountText(int count) {
    if (count <= 0)
        return "No drawings";
    return count == 1 ? "1 drawing" : std::to_string(count) + " drawings";
}

std::string ScanningText(int count) {
    // The one character where the code page has it; the status bar is an ANSI window.
    char ellipsis[8] = {};
    BOOL usedDefault = FALSE;
    const int n = ::WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, L"\u2026", 1, ellipsis, sizeof ellipsis,
                                        nullptr, &usedDefault);
    const std::string dots =
        n > 0 && !usedDefault ? std::string(ellipsis, static_cast<std::size_t>(n)) : "...";
    const std::string drawings =
        count == 1 ? "1 drawing" : std::to_string(count < 0 ? 0 : count) + " drawings";
    return "Reading the folder" + dots + " " + drawings;
}

std::string LayerLabelText(const std::string& folder) {
    // No folder yet (a first run without a start folder): nothing to read, and "\datains.ini" would be
    // the root folder's file.
    if (folder.empty())
        return " Layer name: Current";
    // The separator is always added: datains.ini lies in the folder itself.
    CIniFile ini(FolderSettingsFilePath(folder));
    std::string layer;
    if (ini.ReadFile())
        layer = ini.GetValue(kFolderSettingsSection, kFolderSettingsLayer);
    if (layer.empty())
        layer = "Current";
    return " Layer name: " + layer;
}

CMainFrame::CMainFrame(const ExplorerCall& call, DrawingFolder& folder) : m_call(call), m_folder(folder) {
    WireDrawingFolder();
}

CMainFrame::~CMainFrame() {
    // The folder model outlives the frame: it must not call into a frame that is gone.
    m_folder.onShown = nullptr;
    m_folder.onChosen = nullptr;
}

HFONT CMainFrame::LabelFont() {
    return static_cast<HFONT>(::GetStockObject(DEFAULT_GUI_FONT));
}

CSize CMainFrame::MeasureLabelText(const std::string& text) {
    CClientDC dc(m_hWnd);
    CSelectObject font(dc.GetSafeHdc(), LabelFont());
    return dc.GetTextExtent(text);
}

int CMainFrame::OnCreate(LPCREATESTRUCTA cs) {
    m_fileCommands.SetOwner(m_hWnd);
    if (CFrameWnd::OnCreate(cs) == -1)
        return -1;
    if (!m_wndToolBar.CreateEx(this, TBSTYLE_FLAT,
                               WS_CHILD | WS_VISIBLE | CBRS_TOP | CBRS_GRIPPER | CBRS_TOOLTIPS | CBRS_FLYBY |
                                   CBRS_SIZE_DYNAMIC) ||
        !m_wndToolBar.LoadToolBar(IDR_MAINFRAME))
        return -1;
    // Without its labels or the search edit the frame still stands; the rest of the set-up is skipped.
    if (!CreateMainToolBar())
        return 0;
    // Before any folder is shown (a first run) the label already says which layer a pick goes on.
    UpdateLayerLabel();
    if (!m_wndToolBar2.CreateEx(this, TBSTYLE_FLAT,
                                WS_CHILD | WS_VISIBLE | CBRS_BOTTOM | CBRS_TOOLTIPS | CBRS_FLYBY, CRect(),
                                kPickToolBarId) ||
        !m_wndToolBar2.LoadToolBar(IDR_TOOLBAR2))
        return -1;
    if (!CreatePickToolBar())
        return 0;
    if (!m_wndStatusBar.Create(this) || !m_wndStatusBar.SetIndicators(kIndicators, 4))
        return -1;
    EnableDocking(CBRS_ALIGN_ANY);
    m_wndToolBar.EnableDocking(CBRS_ALIGN_ANY);
    m_wndToolBar2.EnableDocking(CBRS_ALIGN_ANY);
    DockControlBar(&m_wndToolBar);
    DockControlBar(&m_wndToolBar2);
    return 0;
}

bool CMainFrame::CreateToolBarLabel(CToolBar& bar, UINT placeholder, const std::string& text, int extraWidth,
                                    CStatic& label) {
    const int index = bar.CommandToIndex(placeholder);
    if (index < 0)
        return false;
    bar.SetButtonInfo(index, placeholder, TBBS_SEPARATOR, MeasureLabelText(text).cx + extraWidth);
    CRect rc;
    bar.GetItemRect(index, &rc);
    if (!label.Create(text.c_str(), kLabelStyle, rc, &bar, placeholder))
        return false;
    label.SetFont(LabelFont());
    return true;
}

bool CMainFrame::CreateSearchEdit() {
    const int index = m_wndToolBar.CommandToIndex(ID_SEARCH_EDIT);
    if (index < 0)
        return false;
    m_wndToolBar.SetButtonInfo(index, ID_SEARCH_EDIT, TBBS_SEPARATOR, kSearchEditWidth);
    CRect rc;
    m_wndToolBar.GetItemRect(index, &rc);
    // One text line high, centred in the separator, one border width in from each side.
    const int lineHeight = MeasureLabelText("Search:").cy;
    const int border = ::GetSystemMetrics(SM_CXEDGE);
    rc.top += (rc.Height() - lineHeight) / 2;
    rc.bottom = rc.top + lineHeight;
    rc.left += border;
    rc.right -= border;
    if (!m_wndSearch.Create(WS_CHILD | WS_VISIBLE | ES_AUTOHSCROLL, rc, &m_wndToolBar, ID_SEARCH_EDIT))
        return false;
    m_wndSearch.SetFont(LabelFont());
    return true;
}

bool CMainFrame::CreateMainToolBar() {
    return CreateToolBarLabel(m_wndToolBar, ID_SEARCH_LABEL, "Search:", 1, m_wndSearchLabel) &&
           CreateSearchEdit() &&
           CreateToolBarLabel(m_wndToolBar, ID_LAYER_LABEL, " Layer name:", kLayerLabelExtra,
                              m_wndLayerLabel);
}

bool CMainFrame::CreateCaptionLabel(CToolBar& bar, UINT button, const char* caption, CStatic& label) {
    const int index = bar.CommandToIndex(button);
    if (index < 0)
        return false;
    CRect rc;
    bar.GetItemRect(index, &rc);
    const CSize text = MeasureLabelText(caption);
    // Sized to the text, centred over the button; a plain static lets the clicks through to the button.
    CRect at(CPoint(rc.left + (rc.Width() - text.cx) / 2, rc.top + (rc.Height() - text.cy) / 2), text);
    if (!label.Create(caption, WS_CHILD | WS_VISIBLE | SS_CENTER | SS_NOPREFIX, at, &bar, 0xFFFF))
        return false;
    label.SetFont(LabelFont());
    return true;
}

bool CMainFrame::CreatePickToolBar() {
    return CreateCaptionLabel(m_wndToolBar2, ID_ACCEPT, m_call.acceptCaption.c_str(), m_wndAcceptLabel) &&
           CreateCaptionLabel(m_wndToolBar2, ID_CANCEL_PICK, m_call.cancelCaption.c_str(), m_wndCancelLabel);
}

CView* CMainFrame::MakeFolderPane() {
    m_pFolderPane = new CLeftView;
    m_pFolderPane->SetStartShellPath(m_call.startShellPath);
    return m_pFolderPane;
}

CChildView* CMainFrame::GetFolderTree() const {
    return m_pFolderPane ? m_pFolderPane->GetTree() : nullptr;
}

void CMainFrame::WireFolderTree() {
    CChildView* tree = GetFolderTree();
    if (!tree)
        return;
    tree->SetDrawingFolder(&m_folder);
    // A folder without a file-system path shows its name; the grid is empty.
    tree->onNoFolderShown = [this](const std::string& label) { SetTitleText(label); };
    tree->onFolderMenu = [this](HTREEITEM item, CPoint at) { return ShowFolderMenu(item, at); };
    tree->onFocusGrid = [this] {
        if (m_pGridView && m_pGridView->m_hWnd)
            m_pGridView->SetFocus();
    };
    // A walk that did not get to the start folder (renamed, or a drive named otherwise since) leaves the
    // keyboard in the grid: the tree would select its top node as soon as it got the focus.
    tree->onWalkEnded = [this](bool reached) {
        if (!reached && m_pGridView && m_pGridView->m_hWnd)
            SetActiveView(m_pGridView, true);
    };
}

void CMainFrame::WireDrawingFolder() {
    m_folder.onShown = [this] { OnFolderShown(); };
    m_folder.onChosen = [this] { OnDrawingChosen(); };
}

void CMainFrame::OnFolderShown() {
    if (!m_hWnd)
        return;
    SetTitleText(FolderTitle());
    EnablePick(false);
    if (m_pGridView && m_pGridView->m_hWnd)
        m_pGridView->Rebuild();
    UpdateLayerLabel();
    if (m_folder.IsScanning()) {
        // The host's thread does not wait for a slow folder: the count follows the scan from a timer.
        m_strIdleMessage = ScanningText(m_folder.ScanCount());
        SetTimer(kTimerScan, kScanCountMs);
    } else {
        KillTimer(kTimerScan);
        // What went wrong stays in the status bar; else it comes back to the count.
        m_strIdleMessage =
            m_folder.Problem().empty() ? DrawingCountText(m_folder.Count()) : m_folder.Problem();
    }
    SetMessageText(m_strIdleMessage);
    if (!m_folder.IsScanning() && !m_chooseAfterScan.name.empty()) {
        const auto again = std::move(m_chooseAfterScan);
        m_chooseAfterScan = {};
        if (m_folder.IsRead() && m_folder.Folder() == again.folder && m_wndSearch.m_hWnd && m_pGridView) {
            m_wndSearch.SetWindowText(again.searchText);
            m_pGridView->ChooseDrawing(again.name);
            // The search has its own message for the status bar: what went wrong is said last.
            if (!m_folder.Problem().empty())
                SetMessageText(m_folder.Problem());
        }
    }
}

void CMainFrame::ChooseAfterScan(const std::string& folder, const std::string& name,
                                 const std::string& searchText) {
    m_chooseAfterScan.folder = folder;
    m_chooseAfterScan.name = name;
    m_chooseAfterScan.searchText = searchText;
}

void CMainFrame::OnTimer(UINT_PTR id) {
    if (id != kTimerScan) {
        CFrameWnd::OnTimer(id);
        return;
    }
    FollowScan();
}

void CMainFrame::FollowScan() {
    if (!m_folder.IsScanning()) {
        KillTimer(kTimerScan);
        return;
    }
    // The scan's end tells the frame (OnFolderShown), which stops the timer.
    if (m_folder.TakeEndedScan())
        return;
    const std::string text = ScanningText(m_folder.ScanCount());
    if (text == m_strIdleMessage)
        return;
    m_strIdleMessage = text;
    SetMessageText(m_strIdleMessage);
}

std::string CMainFrame::FolderTitle() const {
    // A folder that could not be read is not open: the title does not name it (the status bar says why).
    // One refused for its length is still there, and the title, Path and ShellPath all name it.
    // One being read is named while its drawings are counted.
    if (!m_folder.Folder().empty() && !m_folder.IsRead() && !m_folder.IsScanning() &&
        FolderPathProblem(m_folder.Folder()).empty())
        return kExplorerTitle;
    return m_folder.Folder();
}

std::string CMainFrame::GetIdleMessage() const {
    return m_strIdleMessage.empty() ? CFrameWnd::GetIdleMessage() : m_strIdleMessage;
}

void CMainFrame::OnDrawingChosen() {
    if (!m_hWnd)
        return;
    const bool chosen = m_folder.Chosen() >= 0;
    SetTitleText(chosen ? m_folder.ChosenPath() : FolderTitle());
    EnablePick(chosen);
}

bool CMainFrame::ShowFolderMenu(HTREEITEM item, CPoint at) {
    CChildView* tree = GetFolderTree();
    if (!tree || !item)
        return false;
    // Virtual folders (Desktop, My Computer) keep no settings: no menu.
    const std::string folder = tree->FolderPathOf(item);
    if (folder.empty())
        return false;
    CMenu menu;
    if (!menu.CreatePopupMenu() || !menu.AppendMenu(MF_STRING, kFolderMenuSettings, "&Folder settings"))
        return false;
    const int chosen =
        menu.TrackPopupMenu(TPM_RETURNCMD | TPM_RIGHTBUTTON | TPM_NONOTIFY, at.x, at.y, tree->m_hWnd);
    if (chosen != kFolderMenuSettings)
        return true;
    CDialogSetLa dialog(this);
    if (!dialog.SetFolder(folder)) {
        TellUser(FolderPathTooLongMessage(folder));
        return true;
    }
    // The label shows the current folder's layer, which a write or a delete may have changed.
    dialog.onChanged = [this] { UpdateLayerLabel(); };
    dialog.DoModal();
    if (CChildView* again = GetFolderTree())
        again->SetFocus();
    return true;
}

CView* CMainFrame::MakeGridView() {
    auto* grid = new CTessel3View;
    grid->SetFolder(&m_folder);
    grid->SetFileCommands(&m_fileCommands);
    grid->onSortMode = [this] { return m_nSort; };
    grid->onSort = [this](int mode) { SetSortMode(mode); };
    grid->onGrowFrame = [this](int widthChange, int heightChange) {
        const CRect rc = GetWindowRect();
        MoveWindow(rc.left, rc.top, rc.Width() + widthChange, rc.Height() + heightChange);
    };
    grid->onStatusText = [this](const std::string& text) {
        if (m_hWnd)
            SetMessageText(text);
    };
    grid->onTellUser = [this](const std::string& text) { TellUser(text); };
    grid->onFocusPickButtons = [this] { FocusPickButton(m_bPickEnabled ? ID_ACCEPT : ID_CANCEL_PICK); };
    grid->onFocusFolderTree = [this] {
        if (CChildView* tree = GetFolderTree())
            tree->SetFocus();
        else if (m_pFolderPane && m_pFolderPane->m_hWnd)
            m_pFolderPane->SetFocus();
    };
    m_pGridView = grid;
    return grid;
}

static_assert(kFileOpNotDone == kFileCommandNotDone, "the grid and the file operations agree on 'not done'");

bool ExplorerFileCommands::ClipboardHoldsDrawings() {
    return ForFileCommands().ClipboardHoldsDrawings();
}

void ExplorerFileCommands::Copy(const std::vector<std::string>& paths, bool cut) {
    PutFileListOnClipboard(paths, cut);
}

int ExplorerFileCommands::Paste(const std::string& folder) {
    return ForFileCommands().PasteInto(folder, m_owner);
}

int ExplorerFileCommands::Delete(const std::vector<std::string>& paths) {
    return DeleteFiles(m_owner, paths);
}

int ExplorerFileCommands::Rename(const std::string& source, const std::string& destination) {
    return ForFileCommands().RenameFile(source, destination, nullptr);
}

void ExplorerFileCommands::ShowProperties(const std::string& path) {
    ShowFileProperties(path);
}

bool CMainFrame::OnCreateClient(LPCREATESTRUCTA, CCreateContext* context) {
    m_pDoc = context ? dynamic_cast<CTessel3Doc*>(context->m_pCurrentDoc) : nullptr;
    if (m_pDoc)
        m_nSort = m_pDoc->m_nSort;
    m_wndSearch.onSearch = [this](const std::string& text) {
        if (m_pGridView)
            m_pGridView->RunSearch(text);
    };
    m_wndSearch.onAccept = [this] { OnCmdMsg(ID_ACCEPT, 0); };
    if (!m_wndSplitter.CreateStatic(this, 1, 2))
        return false;
    const int leftWidth = m_pDoc ? m_pDoc->m_nSplitterSize : 100;
    const auto makeFolderPane = [this] { return MakeFolderPane(); };
    const auto makeGridView = [this] { return MakeGridView(); };
    // A view that could not be made has already gone: forget it.
    if (!m_wndSplitter.CreateView(0, 0, makeFolderPane, CSize(leftWidth, 0), context)) {
        m_pFolderPane = nullptr;
        return false;
    }
    if (!m_wndSplitter.CreateView(0, 1, makeGridView, CSize(0, 0), context)) {
        m_pGridView = nullptr;
        return false;
    }
    m_wndSplitter.SetColumnInfo(1, 0, kMinGridWidth);
    m_wndSplitter.RecalcLayout();
    WireFolderTree();
    return true;
}

void CMainFrame::TellUser(const std::string& text) {
    // A name too long for a line (a path, a name of 300 characters) is broken: the box stays on the screen.
    const std::string fitted = BreakLongWords(text, kMessageWordChars);
    ::MessageBoxA(m_hWnd, fitted.c_str(), kExplorerMessageCaption, MB_OK | MB_ICONWARNING);
}

void CMainFrame::OnDestroy() {
    if (CTessel3Doc* doc = m_pDoc) {
        const CRect rc = GetWindowRect();
        doc->m_nWindowWidth = rc.Width();
        doc->m_nWindowHeight = rc.Height();
        if (m_wndSplitter.m_hWnd) {
            int current = 0, minimum = 0;
            m_wndSplitter.GetColumnInfo(0, current, minimum);
            doc->m_nSplitterSize = current;
        }
        if (m_pGridView) {
            doc->m_nPictureWidth = m_pGridView->GetPictureWidth();
            doc->m_nPictureHeight = m_pGridView->GetPictureHeight();
        }
        doc->m_nSort = m_nSort;
    }
    CFrameWnd::OnDestroy();
    // The views go with their windows, after this one's.
    m_pGridView = nullptr;
    m_pFolderPane = nullptr;
    // After an accept the dialog has already ended on it and never sees this cancel.
    PostAppResult(kAppCancel);
}

void CMainFrame::EnablePick(bool enable) {
    m_bPickEnabled = enable;
    if (m_wndToolBar2.m_hWnd)
        m_wndToolBar2.GetToolBarCtrl().EnableButton(ID_ACCEPT, enable);
    if (m_wndAcceptLabel.m_hWnd)
        m_wndAcceptLabel.EnableWindow(enable);
}

void CMainFrame::RefreshFolder() {
    // Through the tree while it has a selection: a virtual folder selected there shows no drawings, and
    // reading the folder shown before it would show some.
    CChildView* tree = GetFolderTree();
    if (tree && tree->m_hWnd && tree->GetSelectedItem())
        tree->RefreshCurrentFolder();
    else
        m_folder.Refresh();
}

void CMainFrame::FocusPickButton(UINT id) {
    if (!m_wndToolBar2.m_hWnd)
        return;
    const int index = m_wndToolBar2.CommandToIndex(id);
    if (index < 0)
        return;
    if (::GetFocus() != m_wndToolBar2.m_hWnd)
        m_wndToolBar2.SetFocus();
    m_wndToolBar2.SendMessage(TB_SETHOTITEM, static_cast<WPARAM>(index));
}

void CMainFrame::LeavePickBar() {
    if (m_wndToolBar2.m_hWnd)
        m_wndToolBar2.SendMessage(TB_SETHOTITEM, static_cast<WPARAM>(-1));
}

bool CMainFrame::HandlePickBarKey(UINT vk, bool shift) {
    const int hot = static_cast<int>(m_wndToolBar2.SendMessage(TB_GETHOTITEM));
    const UINT id = hot >= 0 ? m_wndToolBar2.GetItemID(hot) : 0;
    // Accept is skipped while no drawing is chosen.
    const bool onAccept = id == ID_ACCEPT;
    switch (vk) {
    case VK_TAB:
        if (!shift && onAccept) {
            FocusPickButton(ID_CANCEL_PICK);
        } else if (shift && !onAccept && m_bPickEnabled) {
            FocusPickButton(ID_ACCEPT);
        } else {
            LeavePickBar();
            if (shift && m_pGridView && m_pGridView->m_hWnd)
                m_pGridView->SetFocus();
            else if (CChildView* tree = GetFolderTree())
                tree->SetFocus();
            else if (m_pGridView && m_pGridView->m_hWnd)
                m_pGridView->SetFocus();
        }
        return true;
    case VK_LEFT:
    case VK_RIGHT:
        FocusPickButton(vk == VK_RIGHT || !m_bPickEnabled ? ID_CANCEL_PICK : ID_ACCEPT);
        return true;
    case VK_RETURN:
    case VK_SPACE:
        if (id == ID_ACCEPT || id == ID_CANCEL_PICK)
            OnCmdMsg(id, 0);
        return true;
    case VK_ESCAPE:
        PostAppResult(kAppCancel);
        return true;
    default:
        return false;
    }
}

void CMainFrame::SetTitleText(const std::string& text) {
    SetWindowText(text);
}

void CMainFrame::UpdateLayerLabel() {
    if (!m_wndLayerLabel.m_hWnd)
        return;
    m_wndLayerLabel.SetWindowText(LayerLabelText(m_folder.Folder()));
}

void CMainFrame::OnUpdateFrameTitle(bool addToTitle) {
    CFrameWnd::OnUpdateFrameTitle(addToTitle);
    const std::string text = GetWindowText();
    const std::string replaced = ExplorerTitle(text);
    if (replaced != text)
        SetWindowText(replaced);
}

bool CMainFrame::ForwardToGrid(UINT id) {
    // Whether the grid carried it out: an accelerator whose command no one takes is a key that does
    // nothing.
    return m_pGridView && m_pGridView->m_hWnd && static_cast<CWnd*>(m_pGridView)->OnCmdMsg(id, 0);
}

void CMainFrame::SwitchPane() {
    LeavePickBar();
    // Two panes: F6 and Shift+F6 both go to the other one (from anywhere else, to the tree).
    HWND focus = ::GetFocus();
    const bool inTree = focus && m_pFolderPane && m_pFolderPane->m_hWnd &&
                        (focus == m_pFolderPane->m_hWnd || ::IsChild(m_pFolderPane->m_hWnd, focus));
    CChildView* tree = GetFolderTree();
    if (inTree || !tree || !tree->m_hWnd) {
        if (m_pGridView && m_pGridView->m_hWnd)
            m_pGridView->SetFocus();
    } else {
        tree->SetFocus();
    }
}

void CMainFrame::SetSortMode(int mode) {
    m_nSort = mode;
    // The grid re-sorts when it scrolls back to the beginning.
    ForwardToGrid(ID_VIEW_BEGIN);
}

void CMainFrame::ShowHelp() {
    ::ShellExecuteA(m_hWnd, "open", HelpFilePath().c_str(), nullptr, nullptr, SW_SHOWMAXIMIZED);
}

bool CMainFrame::OnCmdMsg(UINT id, int code) {
    const int mode = SortModeOf(id);
    if (mode >= 0) {
        SetSortMode(mode);
        return true;
    }
    if (IsGridCommand(id))
        return ForwardToGrid(id);
    switch (id) {
    case ID_CLEAR:
        if (HWND focus = ::GetFocus())
            ::SendMessageA(focus, WM_CLEAR, 0, 0);
        return true;
    case ID_ACCEPT:
        // Only a chosen drawing can be taken.
        if (m_folder.Chosen() >= 0)
            PostAppResult(kAppAccept);
        return true;
    case ID_CANCEL_PICK:
        PostAppResult(kAppCancel);
        return true;
    case ID_VIEW_REFRESH:
        RefreshFolder();
        return true;
    case ID_NEXT_PANE:
    case ID_PREV_PANE:
        SwitchPane();
        return true;
    case ID_APP_ABOUT: {
        CAboutDlgArx about(this);
        about.DoModal();
        return true;
    }
    case ID_HELP_INDEX:
        ShowHelp();
        return true;
    default:
        return CFrameWnd::OnCmdMsg(id, code);
    }
}

bool CMainFrame::OnUpdateCmdUI(CCmdUI* pCmdUI) {
    const int mode = SortModeOf(pCmdUI->m_nID);
    if (mode >= 0) {
        pCmdUI->Enable(true);
        pCmdUI->SetCheck(m_nSort == mode ? 1 : 0);
        return true;
    }
    switch (pCmdUI->m_nID) {
    case ID_ACCEPT:
        pCmdUI->Enable(m_bPickEnabled);
        return true;
    case ID_CANCEL_PICK:
    case ID_VIEW_REFRESH:
    case ID_NEXT_PANE:
    case ID_PREV_PANE:
    case ID_VIEW_BEGIN:
    case ID_VIEW_INCREASE:
    case ID_VIEW_DECREASE:
    case ID_VIEW_ALIGNE:
    case ID_APP_ABOUT:
        pCmdUI->Enable(true);
        return true;
    default:
        return CFrameWnd::OnUpdateCmdUI(pCmdUI);
    }
}
