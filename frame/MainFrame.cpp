#include "frame/MainFrame.h"

#include "frame/AboutDlgArx.h"
#include "frame/GridLink.h"
#include "frame/FolderPaneLink.h"
#include "settings/IniFile.h"
#include "settings/Tessel3Doc.h"
#include "host/Orvex.h"

#include "res/resource.h"

#include <shellapi.h>

#include <cstdlib>

CMainFrame* g_pMainFrame = nullptr;

const char* const kExplorerTitle = "Kelmar Dwg Thumbnail Explorer";
const char* const kExplorerMessageCaption = "Drawing explorer";

namespace {

const UINT kIndicators[] = {ID_SEPARATOR, ID_INDICATOR_CAPS, ID_INDICATOR_NUM, ID_INDICATOR_SCRL};

constexpr int kSearchEditWidth = 125;
constexpr int kLayerLabelExtra = 1000;
constexpr UINT kLabelStyle = WS_CHILD | WS_VISIBLE | SS_LEFT | SS_CENTERIMAGE | SS_NOPREFIX;

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
    const auto separator = path.find_last_of("\\/");
    if (dot != std::string::npos && (separator == std::string::npos || dot > separator))
        path.erase(dot);
    return path + ".hlp";
}

std::string LayerLabelText(const std::string& folder) {
    // The separator is always added: datains.ini lies in the folder itself.
    CIniFile ini(folder + "\\datains.ini");
    std::string layer;
    if (ini.ReadFile())
        layer = ini.GetValue("Default Parameters", "Layer");
    if (layer.empty())
        layer = "Current";
    return " Layer name: " + layer;
}

CMainFrame::CMainFrame() {
    g_pMainFrame = this;
    if (g_pTessel3Doc)
        m_nSort = g_pTessel3Doc->m_nSort;
}

CMainFrame::~CMainFrame() {
    if (g_pMainFrame == this)
        g_pMainFrame = nullptr;
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
    return CreateCaptionLabel(m_wndToolBar2, ID_ACCEPT, g_szAcceptCaption, m_wndAcceptLabel) &&
           CreateCaptionLabel(m_wndToolBar2, ID_CANCEL_PICK, g_szCancelCaption, m_wndCancelLabel);
}

bool CMainFrame::OnCreateClient(LPCREATESTRUCTA, CCreateContext* context) {
    if (!m_wndSplitter.CreateStatic(this, 1, 2))
        return false;
    const int leftWidth = g_pTessel3Doc ? g_pTessel3Doc->m_nSplitterSize : 100;
    return m_wndSplitter.CreateView(0, 0, &NewFolderPaneView, CSize(leftWidth, 0), context) &&
           m_wndSplitter.CreateView(0, 1, &NewGridView, CSize(0, 0), context);
}

void CMainFrame::OnDestroy() {
    if (CTessel3Doc* doc = g_pTessel3Doc) {
        const CRect rc = GetWindowRect();
        doc->m_nWindowWidth = rc.Width();
        doc->m_nWindowHeight = rc.Height();
        if (m_wndSplitter.m_hWnd) {
            int current = 0, minimum = 0;
            m_wndSplitter.GetColumnInfo(0, current, minimum);
            doc->m_nSplitterSize = current;
        }
        if (GridView()) {
            int width = 0, height = 0;
            GridPictureSize(width, height);
            doc->m_nPictureWidth = width;
            doc->m_nPictureHeight = height;
        }
        doc->m_nSort = m_nSort;
    }
    CFrameWnd::OnDestroy();
    // After an accept the dialog has already ended on it and never sees this cancel.
    PostResult(kExplorerCancel);
}

void CMainFrame::PostResult(int result) {
    CWinApp* app = AfxGetApp();
    if (app && app->m_pMainWnd && app->m_pMainWnd->m_hWnd)
        app->m_pMainWnd->PostMessage(WM_EXPLORER_RESULT, static_cast<WPARAM>(result));
}

CTessel3View* CMainFrame::GetGridView() const {
    return GridView();
}

void CMainFrame::EnablePick(bool enable) {
    m_bPickEnabled = enable;
    if (m_wndToolBar2.m_hWnd)
        m_wndToolBar2.GetToolBarCtrl().EnableButton(ID_ACCEPT, enable);
    if (m_wndAcceptLabel.m_hWnd)
        m_wndAcceptLabel.EnableWindow(enable);
}

void CMainFrame::SetTitleText(const std::string& text) {
    SetWindowText(text);
}

void CMainFrame::UpdateLayerLabel() {
    if (!m_wndLayerLabel.m_hWnd || !g_pTessel3Doc)
        return;
    m_wndLayerLabel.SetWindowText(LayerLabelText(g_pTessel3Doc->m_strPath));
}

void CMainFrame::OnUpdateFrameTitle(bool addToTitle) {
    CFrameWnd::OnUpdateFrameTitle(addToTitle);
    const std::string text = GetWindowText();
    const std::string replaced = ExplorerTitle(text);
    if (replaced != text)
        SetWindowText(replaced);
}

bool CMainFrame::ForwardToGrid(UINT id) {
    if (CWnd* grid = GridViewWindow())
        grid->SendMessage(WM_COMMAND, MAKEWPARAM(id, 0), 0);
    return true;
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
    switch (id) {
    case ID_VIEW_BEGIN:
    case ID_VIEW_INCREASE:
    case ID_VIEW_DECREASE:
    case ID_VIEW_ALIGNE:
    case ID_FILE_OPEN:
    case ID_EDIT_COPY:
    case ID_EDIT_CUT:
    case ID_EDIT_PASTE:
    case ID_SELECT_ALL:
        return ForwardToGrid(id);
    case ID_CLEAR:
        if (HWND focus = ::GetFocus())
            ::SendMessageA(focus, WM_CLEAR, 0, 0);
        return true;
    case ID_ACCEPT:
        // Only a chosen drawing can be taken.
        if (g_pTessel3Doc && !g_pTessel3Doc->m_strName.empty())
            PostResult(kExplorerAccept);
        return true;
    case ID_CANCEL_PICK:
        PostResult(kExplorerCancel);
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
