#include "tree/LeftView.h"

#include "hostapi/NarrowText.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"
#include "tree/StartShellPath.h"

#include "res/resource.h"

namespace {

constexpr UINT kTreeStyle = WS_CHILD | WS_VISIBLE | TVS_HASBUTTONS | TVS_HASLINES | TVS_LINESATROOT;
constexpr UINT kAnimationPeriod = 125; // milliseconds

} // namespace

CChildView::CChildView() {
    SetLoadingIcon(nullptr, true);
    SetAnimationPeriod(kAnimationPeriod);
    m_hHourglassCursor =
        static_cast<HCURSOR>(::LoadCursorW(AfxGetInstanceHandle(), MAKEINTRESOURCEW(IDC_HOURGLASS)));
    SetHourglass(m_hHourglassCursor);
    // The system icons are asked for when an item is first shown, not at insertion: the shell takes
    // milliseconds for each (under Wine about 8 ms for a folder's two icons), which made a folder of
    // 20,000 sub-folders a minutes-long filling. Labels and child indicators stay computed at insertion.
    SetCallbackMask(kCallbackImage | kCallbackSelectedImage);
}

CChildView::~CChildView() {
    if (m_hHourglassCursor)
        ::DestroyCursor(m_hHourglassCursor);
}

bool CChildView::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message != WM_KEYDOWN || pMsg->hwnd != m_hWnd)
        return false;
    switch (pMsg->wParam) {
    case VK_ESCAPE:
        if (!TakeEscapeForMissingMenu())
            PostAppResult(kAppCancel);
        return true;
    case VK_TAB:
        if (onFocusGrid)
            onFocusGrid();
        return true;
    default:
        return false;
    }
}

bool CLeftView::Create(const char* className, const char* windowName, DWORD style, const RECT& rect,
                       CWnd* parent, UINT id, CCreateContext* context) {
    if (!CView::Create(className, windowName, style, rect, parent, id, context))
        return false;
    if (!m_wndTree.Create(kTreeStyle, CRect(), this, AFX_IDW_PANE_FIRST))
        return true; // an empty pane: the explorer works on without its tree
    auto* doc = dynamic_cast<CTessel3Doc*>(m_pDocument);
    m_wndTree.SetDocument(doc);
    // Until the frame has shown itself and the tree has walked to the folder it opens on.
    m_wndTree.FollowSelection(false);
    m_wndTree.PopulateTree(nullptr, 0);
    if (!doc)
        return true;
    if (!m_strStartShellPath.empty())
        doc->m_strShellPath = m_strStartShellPath;
    else if (doc->m_strShellPath.empty() && !doc->m_strPath.empty())
        doc->m_strShellPath =
            StartShellPathOf(WithSeparator(doc->m_strPath)); // settings that only know the folder
    // The walk along that path is the frame's to start (WalkToStartLater), once the grid has its pictures.
    return true;
}

void CLeftView::OnSize(UINT type, int cx, int cy) {
    CView::OnSize(type, cx, cy);
    if (m_wndTree.m_hWnd)
        ::SetWindowPos(m_wndTree.m_hWnd, nullptr, 0, 0, cx, cy, SWP_NOZORDER | SWP_NOMOVE);
}

void CLeftView::OnSetFocus(HWND oldWnd) {
    CView::OnSetFocus(oldWnd);
    if (m_wndTree.m_hWnd)
        m_wndTree.SetFocus();
}
