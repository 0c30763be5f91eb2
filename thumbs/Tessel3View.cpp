#include "thumbs/Tessel3View.h"

#include "preview/PictureLoader.h"
#include "preview/ShowPreview.h"
#include "res/resource.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/AppMessages.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/RenameRules.h"

#include <algorithm>
#include <utility>

namespace {

// Sets a flag for the lifetime of the guard, whatever way the scope is left.
class FlagGuard {
public:
    explicit FlagGuard(bool& flag) : m_flag(flag), m_old(flag) { m_flag = true; }
    ~FlagGuard() { m_flag = m_old; }
    FlagGuard(const FlagGuard&) = delete;
    FlagGuard& operator=(const FlagGuard&) = delete;

private:
    bool& m_flag;
    bool m_old;
};

// Holds the view's drawing while the grid lays its controls out, then paints the view and every control
// in it at once. A layout destroys and creates every control; painting them as the work ends, rather than
// leaving it to paint messages that the view's reappearance ought to cause, is what makes each cell show
// its picture and name after any jump. Nested holds leave the work to the outermost one.
class RedrawHold {
public:
    explicit RedrawHold(HWND view) : m_view(view), m_held(view && ::IsWindowVisible(view)) {
        if (m_held)
            ::SendMessageA(m_view, WM_SETREDRAW, FALSE, 0);
    }
    ~RedrawHold() {
        if (!m_held || !::IsWindow(m_view))
            return;
        ::SendMessageA(m_view, WM_SETREDRAW, TRUE, 0);
        ::RedrawWindow(m_view, nullptr, nullptr,
                       RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | RDW_ALLCHILDREN | RDW_UPDATENOW);
    }
    RedrawHold(const RedrawHold&) = delete;
    RedrawHold& operator=(const RedrawHold&) = delete;

private:
    HWND m_view;
    bool m_held;
};

} // namespace

// ---- the sheet ---------------------------------------------------------------------------------------

bool CGridSheet::PreCreateWindow(CREATESTRUCTA& cs) {
    cs.lpszClass = AfxRegisterWndClass(0, ::LoadCursorA(nullptr, IDC_ARROW), nullptr);
    cs.style |= WS_CLIPCHILDREN | WS_CLIPSIBLINGS;
    return CWnd::PreCreateWindow(cs);
}

LRESULT CGridSheet::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_NCHITTEST:
        return HTTRANSPARENT; // a click between the cells is the view's, as if there were no sheet
    case WM_ERASEBKGND:
        return 1; // the paint fills every pixel
    case WM_PAINT: {
        CPaintDC dc(m_hWnd);
        m_view.DrawSheet(dc);
        return 0;
    }
    case WM_PRINTCLIENT: {
        CDC dc(reinterpret_cast<HDC>(wParam));
        m_view.DrawSheet(dc);
        return 0;
    }
    default:
        return CWnd::WindowProc(message, wParam, lParam);
    }
}

// ---- the view ----------------------------------------------------------------------------------------

CTessel3View::CTessel3View() {
    LabelHeight(); // measured once, before the first layout needs it
}

CTessel3View::~CTessel3View() {
    // The drawing list is the model's, not the view's: the next scan empties it when it fills it anew.
    try {
        DestroyPool();
        m_pool.clear();
    } catch (...) {
        // Destruction goes on; nothing left to report to.
    }
}

int CTessel3View::OnCreate(LPCREATESTRUCTA cs) {
    const CTessel3Doc* doc = Document();
    if (doc && doc->m_nPictureHeight != 0 && doc->m_nPictureWidth != 0) {
        // A size from the settings file is only as small or as large as the size commands could make it.
        const grid::PictureSize size = grid::ClampPicture(doc->m_nPictureWidth, doc->m_nPictureHeight,
                                                          ::GetSystemMetrics(SM_CYVIRTUALSCREEN));
        m_nCellHeight = size.height;
        m_nCellWidth = size.width;
    }
    const int cacheMiB = doc ? doc->m_nPictureCacheMiB : CTessel3Doc::kDefaultPictureCacheMiB;
    m_pictures = std::make_unique<PictureLoader>(static_cast<std::size_t>(cacheMiB) << 20);
    m_pictures->onPictureReady = [this](const PictureKey& key) { OnPictureReady(key); };
    NoteHostPreviewOperation();
    return CScrollView::OnCreate(cs);
}

// ---- the owner --------------------------------------------------------------------------------------

CTessel3Doc* CTessel3View::Document() const {
    return dynamic_cast<CTessel3Doc*>(GetDocument());
}

int CTessel3View::SortMode() const {
    if (onSortMode)
        return onSortMode();
    const CTessel3Doc* doc = Document();
    return doc ? doc->m_nSort : 0;
}

void CTessel3View::SetStatusText(const std::string& text) {
    if (onStatusText)
        onStatusText(text);
}

void CTessel3View::TellUser(const std::string& text) {
    if (onTellUser)
        onTellUser(text);
}

grid::Geometry CTessel3View::Geometry() const {
    grid::Geometry g;
    g.originX = m_ptOrigin.x;
    g.originY = m_ptOrigin.y;
    g.cellWidth = m_nCellWidth;
    g.cellHeight = m_nCellHeight;
    g.gap = m_nGap;
    g.labelHeight = LabelHeight();
    return g;
}

bool CTessel3View::PreCreateWindow(CREATESTRUCTA& cs) {
    // The view's class again, with a light-grey background; children are not painted over.
    cs.lpszClass = AfxRegisterWndClass(CS_DBLCLKS, ::LoadCursorA(nullptr, IDC_ARROW),
                                       static_cast<HBRUSH>(::GetStockObject(LTGRAY_BRUSH)));
    cs.style |= WS_CLIPCHILDREN;
    return CScrollView::PreCreateWindow(cs);
}

void CTessel3View::OnInitialUpdate() {
    CScrollView::OnInitialUpdate();
    SetScrollSizes(MM_TEXT, CSize(0, 0));
}

// ---- operations -------------------------------------------------------------------------------------

void CTessel3View::Rebuild() {
    m_nPoolRows = grid::kDefaultPoolRows;
    ScrollToBegin(true);
}

void CTessel3View::ScrollToBegin(bool sort) {
    RedrawHold hold(m_hWnd);
    m_nColumns = grid::ColumnsForWidth(GetClientRect().Width(), m_nCellWidth, m_nGap);
    m_nOldColumns = m_nColumns; // a later relayout keeps the first drawing where it is
    if (sort && m_pFolder)
        m_pFolder->Sort(SortMode());
    m_nFirstRow = 0;
    // The controls are re-created below, so the contents need not be moved.
    ::SetScrollPos(m_hWnd, SB_HORZ, 0, TRUE);
    ::SetScrollPos(m_hWnd, SB_VERT, 0, TRUE);
    Layout();
}

void CTessel3View::ShowIndex(int index) {
    if (index < 0 || index >= DrawingCount())
        return;
    // Already in the first row shown: only the selection changes (typing a longer prefix).
    const int columns = grid::ColumnsForWidth(GetClientRect().Width(), m_nCellWidth, m_nGap);
    if (columns == m_nColumns && m_nCount == DrawingCount() &&
        index / std::max(1, m_nColumns) == m_nFirstRow) {
        if (exCDwgThumbnail* control = ControlOf(index)) {
            control->ShowSelection();
            return;
        }
    }
    RedrawHold hold(m_hWnd);
    ScrollToBegin(false);
    // Into view, but never past the grid's end: the rows before stay in reach when all would fit.
    m_nFirstRow = std::min(index / std::max(1, m_nColumns), grid::EndFirstRow(m_nRows, m_nVisibleRows));
    Relayout();
}

void CTessel3View::DeselectAll() {
    if (m_pFolder)
        m_pFolder->DeselectAll();
    for (const auto& control : m_pool) {
        if (control->m_hWnd)
            control->ShowSelection();
    }
}

void CTessel3View::SelectAll() {
    if (m_pFolder)
        m_pFolder->SelectAll();
    // Every label on screen shows it; rows made later show it from the records.
    for (const auto& control : m_pool) {
        if (control->m_hWnd)
            control->ShowSelection();
    }
}

void CTessel3View::Increase() {
    if (grid::IncreaseCell(m_nCellHeight, m_nCellWidth, GetClientRect().Height()))
        Refit(false);
}

void CTessel3View::Decrease() {
    if (grid::DecreaseCell(m_nCellHeight, m_nCellWidth))
        Refit(false);
}

void CTessel3View::Align() {
    Refit(true);
}

void CTessel3View::PostRefresh() {
    if (m_hWnd)
        PostMessage(WM_ORVEX_REFRESH);
}

void CTessel3View::Refresh() {
    // The folder's owner hears that it was read again and has the grid rebuilt.
    if (m_pFolder)
        m_pFolder->Refresh();
}

bool CTessel3View::ClipboardHoldsDrawings() const {
    return m_pFileCommands && m_pFileCommands->ClipboardHoldsDrawings();
}

bool CTessel3View::AnySelected() const {
    return m_pFolder && m_pFolder->AnySelected();
}

void CTessel3View::CopySelection(bool cut) {
    if (m_pFileCommands && m_pFolder)
        m_pFileCommands->Copy(m_pFolder->SelectedPaths(), cut);
}

void CTessel3View::PasteFiles() {
    if (!m_pFileCommands || !m_pFolder)
        return;
    const std::string folder = m_pFolder->Folder();
    AfterFileCommand(m_pFileCommands->Paste(folder), FileCommand::Paste, folder, {});
}

void CTessel3View::DeleteSelection() {
    if (!m_pFileCommands || !m_pFolder)
        return;
    std::vector<std::string> names;
    for (int i = 0; i < m_pFolder->Count(); ++i)
        if (m_pFolder->IsSelected(i))
            names.push_back(m_pFolder->Drawing(i).m_strName);
    if (names.empty())
        return;
    const std::string subject =
        names.size() == 1 ? "\"" + names[0] + "\"" : std::to_string(names.size()) + " drawings";
    AfterFileCommand(m_pFileCommands->Delete(m_pFolder->SelectedPaths()), FileCommand::Delete, subject,
                     names);
}

void CTessel3View::AfterFileCommand(int result, FileCommand command, const std::string& subject,
                                    const std::vector<std::string>& names) {
    if (result == kFileCommandNotDone || result == ERROR_CANCELLED)
        return;
    // Done or not, the grid shows what is on disk (the message below runs its own loop: the folder is read
    // again while the user reads it).
    PostRefresh();
    if (result == 0 || !m_pFolder)
        return;
    FileCommandFailure why;
    why.error = result;
    const std::string& folder = m_pFolder->Folder();
    if (::GetFileAttributesA(folder.c_str()) == INVALID_FILE_ATTRIBUTES) {
        why.missing = folder;
    } else {
        for (const std::string& name : names) {
            if (::GetFileAttributesA(DrawingFolder::Join(folder, name).c_str()) == INVALID_FILE_ATTRIBUTES) {
                why.missing = name;
                break;
            }
        }
    }
    // Access denied, write protected, or the shell's own code for a source it may not touch.
    why.readOnly = result == ERROR_ACCESS_DENIED || result == ERROR_WRITE_PROTECT || result == 0x78;
    TellUser(FileCommandFailureText(command, subject, why));
}

ThumbnailOwner::RenameOutcome CTessel3View::RenameDrawing(const std::string& oldName,
                                                          const std::string& newName) {
    if (!m_pFolder)
        return RenameOutcome::Refused;
    const std::string& folder = m_pFolder->Folder();
    const RenameVerdict verdict = CheckRename(folder, oldName, newName, [&folder](const std::string& name) {
        return ::GetFileAttributesA(DrawingFolder::Join(folder, name).c_str()) != INVALID_FILE_ATTRIBUTES;
    });
    if (verdict != RenameVerdict::Rename) {
        if (verdict != RenameVerdict::Unchanged)
            TellUser(RenameRefusalText(verdict, newName));
        return RenameOutcome::Refused;
    }
    if (!m_pFileCommands)
        return RenameOutcome::Refused;
    // The shell's loop runs inside: the grid may re-create its controls meanwhile. The rescan that follows
    // rebuilds the grid, which destroys the label: it runs once this message is done.
    const int result =
        m_pFileCommands->Rename(DrawingFolder::Join(folder, oldName), DrawingFolder::Join(folder, newName));
    AfterFileCommand(result, FileCommand::Rename, oldName, {oldName});
    return result == 0 ? RenameOutcome::Renamed : RenameOutcome::Refused;
}

void CTessel3View::ShowProperties(int index) {
    // The full path: the property sheet does not depend on the current directory.
    if (m_pFileCommands && m_pFolder && index >= 0 && index < m_pFolder->Count())
        m_pFileCommands->ShowProperties(m_pFolder->PathOf(index));
}

// ---- what the thumbnails report ---------------------------------------------------------------------

int CTessel3View::DrawingCount() const {
    return m_pFolder ? m_pFolder->Count() : 0;
}

const DrawingFolder& CTessel3View::Folder() const {
    return *m_pFolder; // thumbnails exist only while the grid shows a folder's drawings
}

void CTessel3View::SelectAndChoose(int index, bool clearOthers) {
    Folder().Drawing(index); // a control left over from a list that changed: the invalid-argument error
    if (clearOthers)
        DeselectAll();
    m_pFolder->Select(index);
    if (exCDwgThumbnail* control = ControlOf(index))
        control->ShowSelection();
    m_pFolder->Choose(index);
    SetStatusText(std::string()); // a search's "no drawing starts with" is over
}

void CTessel3View::TakeFocusFromElsewhere() {
    // From the folder tree, the search edit, or a label being renamed: a click outside the label ends the
    // rename and gives the old name back (the label does so when it loses the focus).
    if (m_hWnd && ::GetFocus() != m_hWnd)
        ::SetFocus(m_hWnd);
}

void CTessel3View::OnThumbnailMouseDown() {
    TakeFocusFromElsewhere();
}

void CTessel3View::OnLButtonDown(UINT, CPoint) {
    TakeFocusFromElsewhere();
    Default();
}

void CTessel3View::OnThumbnailClick(int index, bool toggle) {
    if (!toggle) {
        SelectAndChoose(index, true);
        return;
    }
    Folder().Drawing(index); // a control left over from a list that changed: the invalid-argument error
    exCDwgThumbnail* control = ControlOf(index);
    if (control)
        control->SetFocus();
    if (m_pFolder->IsSelected(index)) {
        m_pFolder->Deselect(index);
        if (control)
            control->ShowSelection();
        m_pFolder->ChooseNone();
    } else {
        SelectAndChoose(index, false);
    }
}

void CTessel3View::OnThumbnailPick(int index) {
    Folder().Drawing(index); // a control left over from a list that changed: the invalid-argument error
    m_pFolder->Choose(index);
    PostAppResult(kAppAccept);
}

void CTessel3View::OnThumbnailKey(WPARAM key, LPARAM data) {
    // Keyboard navigation belongs to the grid.
    if (!m_hWnd)
        return;
    ::SetFocus(m_hWnd);
    ::PostMessageA(m_hWnd, WM_KEYDOWN, key, data);
}

ThumbnailOwner::RenameOutcome CTessel3View::OnThumbnailRename(const std::string& oldName,
                                                              const std::string& newName) {
    return RenameDrawing(oldName, newName);
}

void CTessel3View::OnThumbnailMenu(int index, POINT screenPoint) {
    SelectAndChoose(index, false);
    CMenu menu;
    CMenu popup = BuildThumbnailMenu(menu, SortMode(), ClipboardHoldsDrawings());
    if (!popup.m_hMenu)
        return;
    const int command = popup.TrackPopupMenu(TPM_RETURNCMD | TPM_RIGHTBUTTON | TPM_NONOTIFY, screenPoint.x,
                                             screenPoint.y, m_hWnd);
    RunThumbnailCommand(index, command);
}

void CTessel3View::RunThumbnailCommand(int index, int command) {
    switch (command) {
    case ID_SORT_NAME:
    case ID_SORT_DATE:
    case ID_SORT_SIZE:
        // The sort belongs to the frame, which keeps it for the next run.
        if (onSort)
            onSort(command == ID_SORT_NAME ? 0 : command == ID_SORT_DATE ? 1 : 2);
        break;
    // The file commands run the shell's loops.
    case ID_THUMB_COPY:
        CopySelection(false);
        break;
    case ID_THUMB_DELETE:
        DeleteSelection();
        break;
    case ID_THUMB_PASTE:
        PasteFiles();
        break;
    case ID_THUMB_RENAME:
        // The menu's loop may have let the grid re-create its controls: the one showing index now.
        if (exCDwgThumbnail* control = ControlOf(index))
            control->Label().BeginRename();
        break;
    case ID_THUMB_PROPERTY:
        ShowProperties(index);
        break;
    default:
        break;
    }
}

int CTessel3View::RunContextMenu(POINT screenPoint) {
    CMenu menu;
    if (!menu.CreatePopupMenu())
        return 0;
    const UINT selection = AnySelected() ? MF_ENABLED : MF_GRAYED;
    menu.AppendMenu(MF_STRING | selection, kGridMenuCopy, "&Copy");
    menu.AppendMenu(MF_STRING | selection, kGridMenuDelete, "&Delete");
    menu.AppendMenu(MF_STRING | (ClipboardHoldsDrawings() ? MF_ENABLED : MF_GRAYED), kGridMenuPaste,
                    "&Paste");
    menu.AppendMenu(MF_STRING | MF_GRAYED, kGridMenuRename, "&Rename");
    const int command = menu.TrackPopupMenu(TPM_RIGHTBUTTON | TPM_NONOTIFY | TPM_RETURNCMD, screenPoint.x,
                                            screenPoint.y, m_hWnd);
    switch (command) {
    case kGridMenuCopy:
        CopySelection(false);
        break;
    case kGridMenuPaste:
        PasteFiles();
        break;
    case kGridMenuDelete:
        DeleteSelection();
        break;
    default:
        break;
    }
    return command;
}

void CTessel3View::OnRButtonDown(UINT flags, CPoint pt) {
    POINT screen = pt;
    ::ClientToScreen(m_hWnd, &screen);
    RunContextMenu(screen);
    CScrollView::OnRButtonDown(flags, pt);
}

exCDwgThumbnail* CTessel3View::ControlOf(int index) {
    const int size = PoolSize();
    if (index < 0 || size == 0)
        return nullptr;
    exCDwgThumbnail& control = PoolControl(grid::PoolSlot(index, size));
    return control.m_hWnd && control.ListIndex() == index ? &control : nullptr;
}

// ---- layout -----------------------------------------------------------------------------------------

void CTessel3View::DestroyPool() {
    for (const auto& control : m_pool) {
        if (control->m_hWnd)
            control->DestroyWindow();
    }
}

void CTessel3View::Layout() {
    RedrawHold hold(m_hWnd);
    DestroyPool();
    m_pool.clear();
    m_nCount = DrawingCount();
    {
        // A client beyond the largest screen would need more controls than the process can spare.
        const CRect client = GetClientRect();
        grid::GrowToLiveLimit(m_nCellHeight, m_nCellWidth, LabelHeight(), m_nGap, client.Width(),
                              client.Height());
    }
    const grid::Geometry g = Geometry();

    // Showing or hiding a scroll bar changes the client area: settle the bars first. A vertical bar that
    // appears may leave too little width for the columns; then there is one column less.
    grid::LayoutNumbers n;
    int clientHeight = GetClientRect().Height();
    for (int pass = 0; pass < 4; ++pass) {
        n = grid::ComputeLayout(g, m_nCount, m_nColumns, clientHeight);
        {
            FlagGuard guard(m_bAligning); // the size messages of the bars do not re-enter the layout
            SetScrollSizes(MM_TEXT, CSize(n.totalWidth, n.totalHeight), CSize(n.lineX, n.lineY),
                           CSize(n.lineX, n.lineY));
        }
        const CRect now = GetClientRect();
        bool changed = now.Height() != clientHeight;
        clientHeight = now.Height();
        const int fit = grid::ColumnsForWidth(now.Width(), m_nCellWidth, m_nGap);
        if (m_nCount > 0 && fit < m_nColumns) {
            m_nFirstRow = grid::RelayoutFirstRow(m_nColumns, m_nFirstRow, fit, m_nCount);
            m_nColumns = fit;
            m_nOldColumns = fit;
            changed = true;
        }
        if (!changed)
            break;
    }
    m_nRows = n.rows;
    m_nVisibleRows = n.visibleRows;
    m_nPoolRows = n.poolRows;
    m_nTotalHeight = n.totalHeight;
    m_nTotalWidth = n.totalWidth;
    // The bars are settled: the thumb shows where the first row lies.
    ::SetScrollPos(m_hWnd, SB_VERT, grid::BarPosOfRow(m_nFirstRow, LastFirstRow(), BarMaxPos()), TRUE);
    PlaceSheet();
    if (m_nCount == 0)
        return;

    m_pool.reserve(static_cast<std::size_t>(n.poolSize));
    while (PoolSize() < n.poolSize)
        m_pool.push_back(std::make_unique<exCDwgThumbnail>());
    int top = m_ptOrigin.y;
    for (int row = m_nFirstRow; row < m_nFirstRow + m_nPoolRows; ++row) {
        // A row wholly below the client area is made once the grid has drawn: a first step finds it made.
        if (row > m_nFirstRow && top >= clientHeight) {
            if (!m_bRowsPending && PostMessage(WM_ORVEX_MORE_ROWS))
                m_bRowsPending = true;
            if (m_bRowsPending)
                break;
        }
        CreateRow(row, top);
        top += g.RowPitch();
    }
    ScrollToPosition(GetScrollPosition());
    SchedulePictures();
}

// ---- pictures ---------------------------------------------------------------------------------------

void CTessel3View::SchedulePictures() {
    if (!m_bPicturesPending && m_pictures && m_hWnd && PostMessage(WM_ORVEX_PICTURES))
        m_bPicturesPending = true;
}

void CTessel3View::QueuePictures() {
    m_bPicturesPending = false;
    if (!m_pictures || !m_pFolder || m_nColumns <= 0)
        return;
    if (m_nFirstRow != m_nQueuedFirstRow)
        m_nScrollDirection = m_nFirstRow > m_nQueuedFirstRow ? 1 : -1;
    m_nQueuedFirstRow = m_nFirstRow;
    // Every picture area has the size of the first live control's client area.
    CRect area;
    for (const auto& control : m_pool)
        if (control->m_hWnd) {
            area = control->GetClientRect();
            break;
        }
    if (area.Width() <= 0 || area.Height() <= 0)
        return;
    // The visible rows and the one shown in part below them, then as many ahead.
    const int cells = (m_nVisibleRows + 1) * m_nColumns;
    const std::vector<int> order =
        PictureOrder(m_nFirstRow * m_nColumns, cells, cells, m_nScrollDirection, m_nCount);
    std::vector<PictureKey> keys;
    keys.reserve(order.size());
    for (int index : order)
        keys.push_back(DrawingPictureKey(Folder(), index, area.Width(), area.Height()));
    // The visible cells come first in the order, the cells ahead after them.
    const std::size_t shown =
        static_cast<std::size_t>(std::count_if(order.begin(), order.end(), [&](int index) {
            return index >= m_nFirstRow * m_nColumns && index < m_nFirstRow * m_nColumns + cells;
        }));
    m_pictures->Want(keys, shown);
}

void CTessel3View::OnPictureReady(const PictureKey& key) {
    for (const auto& control : m_pool)
        if (control->m_hWnd && Folder().PathOf(control->ListIndex()) == key.path)
            ::InvalidateRect(control->m_hWnd, nullptr, FALSE);
}

CPoint CTessel3View::SheetOrigin() const {
    POINT origin{0, 0};
    if (m_wndSheet.m_hWnd)
        ::MapWindowPoints(m_wndSheet.m_hWnd, m_hWnd, &origin, 1);
    return CPoint(origin.x, origin.y);
}

int CTessel3View::SheetMargin() const {
    // Some twenty steps of the default size between two moves back; never less than two rows, so that a
    // step always finds a row of margin left.
    constexpr int kMargin = 4096;
    return std::max(kMargin, 2 * Geometry().RowPitch());
}

void CTessel3View::PlaceSheet() {
    const CRect client = GetClientRect();
    const int margin = SheetMargin();
    const CRect rect(0, -margin, std::max(m_nTotalWidth, client.Width()), client.Height() + margin);
    if (m_wndSheet.m_hWnd)
        ::SetWindowPos(m_wndSheet.m_hWnd, nullptr, rect.left, rect.top, rect.Width(), rect.Height(),
                       SWP_NOZORDER | SWP_NOACTIVATE);
    else
        m_wndSheet.CreateEx(0, nullptr, "", WS_CHILD | WS_VISIBLE, rect, this, 0);
}

void CTessel3View::KeepSheetCovering() {
    if (!m_wndSheet.m_hWnd)
        return;
    const CRect client = GetClientRect();
    const CPoint origin = SheetOrigin();
    CRect sheet = m_wndSheet.GetClientRect();
    sheet.OffsetRect(origin);
    const int pitch = Geometry().RowPitch();
    if (sheet.left <= 0 && sheet.right >= client.right && sheet.top <= -pitch &&
        sheet.bottom >= client.bottom + pitch)
        return;
    // Back to the margin above the client area; every control moves the other way by as much, so nothing
    // moves on the screen and nothing needs painting. What waits to be painted is painted first: it is
    // kept in the coordinates of the window it belongs to and would land in the wrong place.
    ::RedrawWindow(m_hWnd, nullptr, nullptr, RDW_UPDATENOW | RDW_ALLCHILDREN);
    const int margin = SheetMargin();
    const CPoint to(std::min<int>(origin.x, 0), -margin);
    const int width = std::max<int>(m_nTotalWidth, client.right - to.x);
    const int height = client.Height() + 2 * margin;
    const int dx = origin.x - to.x;
    const int dy = origin.y - to.y;
    constexpr UINT kStill = SWP_NOZORDER | SWP_NOACTIVATE | SWP_NOSIZE | SWP_NOREDRAW | SWP_NOCOPYBITS;
    auto shift = [&](HWND control) {
        CRect rc;
        ::GetWindowRect(control, &rc);
        ::MapWindowPoints(nullptr, m_wndSheet.m_hWnd, reinterpret_cast<POINT*>(&rc), 2);
        ::SetWindowPos(control, nullptr, rc.left + dx, rc.top + dy, 0, 0, kStill);
    };
    ::SetWindowPos(m_wndSheet.m_hWnd, nullptr, to.x, to.y, width, height,
                   SWP_NOZORDER | SWP_NOACTIVATE | SWP_NOREDRAW | SWP_NOCOPYBITS);
    for (const auto& control : m_pool) {
        if (!control->m_hWnd)
            continue;
        shift(control->m_hWnd);
        if (control->Label().m_hWnd)
            shift(control->Label().m_hWnd);
    }
    // A client area that grew without a new layout leaves part of the larger sheet unpainted.
    if (width != sheet.Width() || height != sheet.Height())
        ::RedrawWindow(m_wndSheet.m_hWnd, nullptr, nullptr,
                       RDW_INVALIDATE | RDW_ERASE | RDW_ALLCHILDREN | RDW_UPDATENOW);
}

void CTessel3View::DrawSheet(CDC& dc) {
    if (m_wndSheet.m_hWnd) // without a sheet the controls sit on the view, whose paint fills the background
        dc.FillSolidRect(m_wndSheet.GetClientRect(), ::GetSysColor(COLOR_SCROLLBAR));
    for (const auto& control : m_pool) {
        CThumbLabel& label = control->Label();
        if (label.m_hWnd && label.IsRenaming())
            dc.DrawEdge(label.EdgeRect(), EDGE_SUNKEN, BF_RECT);
    }
}

void CTessel3View::CreateRow(int row, int rowTop) {
    PlaceRow(row, rowTop, false);
    SetFocus();
}

void CTessel3View::CreatePendingRows() {
    // Rows are laid out from the first row at the top with nothing scrolled sideways (after a layout and
    // after each row step); otherwise a step makes what it needs.
    if (!std::exchange(m_bRowsPending, false) || m_nCount == 0 || GetScrollPosition().x != 0)
        return;
    const int pitch = Geometry().RowPitch();
    int top = m_ptOrigin.y;
    for (int row = m_nFirstRow; row < m_nFirstRow + m_nPoolRows; ++row, top += pitch)
        PlaceRow(row, top, true);
}

void CTessel3View::PlaceRow(int row, int rowTop, bool onlyMissing) {
    const int poolSize = PoolSize();
    if (row < 0 || poolSize == 0)
        return;
    const grid::Geometry g = Geometry();
    const CPoint sheet = SheetOrigin();
    for (int column = 0; column < m_nColumns; ++column) {
        const grid::Cell cell = grid::CellOf(g, m_nColumns, poolSize, row, column, rowTop);
        exCDwgThumbnail& control = PoolControl(cell.slot);
        if (onlyMissing && control.m_hWnd)
            continue;
        // The cell in the view's coordinates; the controls sit on the sheet.
        CRect rect(cell.left, cell.top, cell.right, cell.bottom);
        rect.OffsetRect(-sheet.x, -sheet.y);
        // A row scrolled into view takes over the windows of the row that left it.
        if (cell.index < m_nCount && control.Rebind(Folder().Drawing(cell.index).m_strName, cell.index, rect))
            continue;
        if (control.m_hWnd)
            control.DestroyWindow();
        if (cell.index < m_nCount)
            control.Create(Folder().Drawing(cell.index).m_strName, cell.index, nullptr, WS_CHILD, rect,
                           Sheet(), this, 0);
    }
}

void CTessel3View::Refit(bool resizeFrame) {
    if (m_nRows <= 0)
        return;
    FlagGuard guard(m_bAligning);
    CRect client = GetClientRect();
    if (resizeFrame && onGrowFrame) {
        // With a frame of no size the numbers are what the frame must grow (or shrink) by.
        const CSize room = FrameRoom();
        const grid::RefitNumbers n =
            grid::ComputeRefit(Geometry(), client.right, client.bottom, 0, 0, room.cx, room.cy);
        onGrowFrame(n.frameWidth, n.frameHeight);
        client = GetClientRect();
    }
    // The columns the client holds now (no room to grow: whole columns only).
    m_nColumns = grid::ComputeRefit(Geometry(), client.right, client.bottom, 0, 0, 0, 0).columns;
    Relayout();
}

CSize CTessel3View::FrameRoom() const {
    // How far the window may grow to the right and down and stay inside its screen's work area.
    HWND top = ::GetAncestor(m_hWnd, GA_ROOT);
    CRect frame;
    MONITORINFO monitor{};
    monitor.cbSize = sizeof monitor;
    if (!top || !::GetWindowRect(top, &frame) ||
        !::GetMonitorInfoA(::MonitorFromWindow(top, MONITOR_DEFAULTTONEAREST), &monitor))
        return CSize(0, 0);
    return CSize(std::max(0L, monitor.rcWork.right - frame.right),
                 std::max(0L, monitor.rcWork.bottom - frame.bottom));
}

void CTessel3View::Relayout() {
    RedrawHold hold(m_hWnd);
    DestroyPool();
    m_pool.clear();
    const int firstRow = grid::RelayoutFirstRow(m_nOldColumns, m_nFirstRow, m_nColumns, m_nCount);
    m_nOldColumns = m_nColumns;
    ::SetScrollPos(m_hWnd, SB_HORZ, m_ptOrigin.x, TRUE);
    m_nFirstRow = firstRow;
    Layout();
    SetFocus();
}

// ---- scrolling --------------------------------------------------------------------------------------

grid::ScrollState CTessel3View::CurrentScrollState() const {
    grid::ScrollState s;
    s.firstRow = m_nFirstRow;
    s.visibleRows = m_nVisibleRows;
    s.rows = m_nRows;
    const CPoint pos = GetScrollPosition();
    s.x = pos.x;
    s.y = pos.y;
    s.totalHeight = m_nTotalHeight;
    s.clientHeight = GetClientRect().Height();
    return s;
}

void CTessel3View::ApplyLineStep(const grid::LineStep& step, const grid::ScrollState& before,
                                 const grid::ScrollState& after, int direction) {
    if (step.resetX) {
        ::SetScrollPos(m_hWnd, SB_HORZ, 0, TRUE);
        ScrollWindow(before.x, 0);
    }
    if (step.createRow >= 0)
        CreateRow(step.createRow, step.createRowTop);
    if (!step.moved)
        return;
    m_nFirstRow = after.firstRow;
    SchedulePictures();
    // The contents always move by exactly one row; the thumb only shows where that row lies.
    ::SetScrollPos(m_hWnd, SB_VERT, after.y, TRUE);
    ScrollWindow(0, -direction * Geometry().RowPitch());
    KeepSheetCovering();
    UpdateWindow();
}

bool CTessel3View::OnScrollBy(CSize sizeScroll, bool doScroll) {
    const bool scrolled = CScrollView::OnScrollBy(sizeScroll, doScroll);
    KeepSheetCovering();
    return scrolled;
}

void CTessel3View::LineUp() {
    grid::ScrollState s = CurrentScrollState();
    const grid::ScrollState before = s;
    const grid::LineStep step = grid::LineUp(s, Geometry());
    ApplyLineStep(step, before, s, -1);
}

void CTessel3View::LineDown() {
    grid::ScrollState s = CurrentScrollState();
    const grid::ScrollState before = s;
    const grid::LineStep step = grid::LineDown(s, Geometry());
    ApplyLineStep(step, before, s, +1);
}

void CTessel3View::PageUp() {
    m_nFirstRow = grid::PageUpFirstRow(m_nFirstRow, m_nVisibleRows);
    Relayout();
}

void CTessel3View::PageDown() {
    m_nFirstRow = grid::PageDownFirstRow(m_nFirstRow, m_nVisibleRows, m_nRows);
    Relayout();
}

int CTessel3View::LastFirstRow() const {
    return grid::EndFirstRow(m_nRows, m_nVisibleRows);
}

int CTessel3View::BarMaxPos() const {
    return grid::BarMaxPos(m_nTotalHeight, GetClientRect().Height());
}

bool CTessel3View::OnScroll(UINT scrollCode, UINT pos, bool doScroll) {
    const UINT vertical = HIBYTE(scrollCode);
    if (vertical == 0xFF) // horizontal only: the base scrolls the grid sideways
        return CScrollView::OnScroll(scrollCode, pos, doScroll);
    switch (vertical) {
    case SB_THUMBTRACK:
    case SB_THUMBPOSITION: {
        // The grid goes where the thumb is, however far. While it moves, the 32-bit track position; at the
        // drop, the drop's own position (the bar's range is capped well inside the message's 16 bits).
        const int at = vertical == SB_THUMBTRACK ? TrackPos(SB_VERT) : static_cast<int>(pos);
        const int row = grid::RowOfBarPos(at, LastFirstRow(), BarMaxPos());
        if (row == m_nFirstRow)
            return false;
        m_nFirstRow = row;
        Relayout();
        return true;
    }
    case SB_LINEUP:
        LineUp();
        return true;
    case SB_LINEDOWN:
        LineDown();
        return true;
    case SB_PAGEUP:
        PageUp();
        return true;
    case SB_PAGEDOWN:
        PageDown();
        return true;
    case SB_ENDSCROLL:
        return false;
    case SB_TOP:
        // Moving the contents to the top of the capped range would lose the rows: start over instead.
        ScrollToBegin(false);
        return true;
    case SB_BOTTOM:
        m_nFirstRow = grid::EndFirstRow(m_nRows, m_nVisibleRows);
        Relayout();
        return true;
    default:
        return CScrollView::OnScroll(scrollCode, pos, doScroll);
    }
}

// ---- keyboard, commands, messages -------------------------------------------------------------------

bool CTessel3View::HandleKey(UINT key) {
    switch (key) {
    case VK_TAB:
        // Tab goes on to the accept and cancel buttons, Shift+Tab back to the tree.
        if (::GetKeyState(VK_SHIFT) & 0x8000) {
            if (onFocusFolderTree)
                onFocusFolderTree();
        } else if (onFocusPickButtons) {
            onFocusPickButtons();
        }
        return true;
    case VK_RETURN:
        TakeChosen();
        return true;
    case VK_PRIOR:
        PageUp();
        return true;
    case VK_NEXT:
        PageDown();
        return true;
    case VK_END:
        m_nFirstRow = grid::EndFirstRow(m_nRows, m_nVisibleRows);
        Relayout();
        return true;
    case VK_HOME:
        ScrollToBegin(false);
        return true;
    case VK_UP:
        LineUp();
        return true;
    case VK_DOWN:
        LineDown();
        return true;
    case VK_ESCAPE:
        PostAppResult(kAppCancel);
        return true;
    default:
        return false;
    }
}

void CTessel3View::TakeChosen() {
    // As the accept button does; with none chosen nothing happens.
    if (m_pFolder && m_pFolder->Chosen() >= 0)
        PostAppResult(kAppAccept);
}

bool CTessel3View::PreTranslateMessage(MSG* pMsg) {
    if (pMsg->message != WM_KEYDOWN || !m_hWnd)
        return false;
    try {
        return HandleKey(static_cast<UINT>(pMsg->wParam));
    } catch (...) {
        AfxReportCurrentException();
        return true;
    }
}

void CTessel3View::OnKeyDown(UINT nChar, UINT repeat, UINT flags) {
    if (nChar == VK_ESCAPE)
        PostAppResult(kAppCancel);
    else
        Default();
}

bool CTessel3View::OnCmdMsg(UINT id, int code) {
    // The grid's commands, as the frame passes them on: each is one operation of the view.
    static const struct {
        UINT id;
        void (*run)(CTessel3View&);
    } kCommands[] = {
        {ID_VIEW_BEGIN, [](CTessel3View& view) { view.ScrollToBegin(true); }},
        {ID_VIEW_INCREASE, [](CTessel3View& view) { view.Increase(); }},
        {ID_VIEW_DECREASE, [](CTessel3View& view) { view.Decrease(); }},
        {ID_VIEW_ALIGNE, [](CTessel3View& view) { view.Align(); }},
        {ID_SELECT_ALL, [](CTessel3View& view) { view.SelectAll(); }},
        {ID_FILE_OPEN, [](CTessel3View& view) { view.TakeChosen(); }},
        {ID_EDIT_COPY, [](CTessel3View& view) { view.CopySelection(false); }},
        {ID_EDIT_CUT, [](CTessel3View& view) { view.CopySelection(true); }},
        {ID_EDIT_PASTE, [](CTessel3View& view) { view.PasteFiles(); }},
    };
    for (const auto& command : kCommands) {
        if (command.id == id) {
            command.run(*this);
            return true;
        }
    }
    return CScrollView::OnCmdMsg(id, code);
}

void CTessel3View::OnSize(UINT type, int cx, int cy) {
    CScrollView::OnSize(type, cx, cy);
    if (!m_bAligning)
        Refit(false);
    KeepSheetCovering();
    RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
}

bool CTessel3View::OnEraseBkgnd(CDC*) {
    return true; // OnDraw fills the whole client area
}

void CTessel3View::OnDraw(CDC* pDC) {
    const int saved = pDC->SaveDC();
    pDC->SetViewportOrg(0, 0);
    const CRect client = GetClientRect();
    pDC->IntersectClipRect(client);
    pDC->FillSolidRect(client, ::GetSysColor(COLOR_SCROLLBAR));
    // What lies on the sheet, where the sheet lies (the view's own paint never shows under it).
    const CPoint sheet = SheetOrigin();
    pDC->SetViewportOrg(sheet.x, sheet.y);
    DrawSheet(*pDC);
    pDC->RestoreDC(saved);
}

void CTessel3View::OnDestroy() {
    DestroyPool();
    m_pictures.reset(); // within PictureLoader::kEndWaitMs, even with a read that never returns
    CScrollView::OnDestroy();
}

LRESULT CTessel3View::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_ORVEX_REFRESH:
        Refresh();
        return 0;
    case WM_ORVEX_MORE_ROWS:
        CreatePendingRows();
        return 0;
    case WM_ORVEX_PICTURES:
        QueuePictures();
        return 0;
    case WM_PRINTCLIENT: {
        // Drawing into a given DC (screenshots, print-window): the background and the rename edge.
        CDC dc(reinterpret_cast<HDC>(wParam));
        OnPrepareDC(&dc);
        OnDraw(&dc);
        return 0;
    }
    default:
        return CScrollView::WindowProc(message, wParam, lParam);
    }
}
