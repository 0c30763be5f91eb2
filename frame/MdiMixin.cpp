#include "frame/MdiMixin.h"

#include "frame/MainFrame.h"
#include "hostapi/HostApi.h"
#include "hostapi/NarrowText.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"
#include "thumbs/Tessel3View.h"
#include "tree/LeftView.h"

#include "res/resource.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

namespace {

// Shows the folder the explorer starts in (the frame hears it and lays the grid out). Returns what the
// scan has to say (a refused folder, files left out), or empty.
std::string ShowStartFolder(DrawingFolder& folder, const std::string& startPath,
                            const std::string& savedPath) {
    const std::string start = StartFolder(startPath, savedPath);
    if (start.empty())
        return {};
    folder.Show(start);
    return folder.Problem();
}

RECT VirtualScreen() {
    const int x = ::GetSystemMetrics(SM_XVIRTUALSCREEN), y = ::GetSystemMetrics(SM_YVIRTUALSCREEN);
    return RECT{x, y, x + ::GetSystemMetrics(SM_CXVIRTUALSCREEN), y + ::GetSystemMetrics(SM_CYVIRTUALSCREEN)};
}

// How far a maximised frame reaches past its screen on each side: its sizing border.
SIZE SizingBorder() {
    const int padding = ::GetSystemMetrics(SM_CXPADDEDBORDER);
    return SIZE{::GetSystemMetrics(SM_CXSIZEFRAME) + padding, ::GetSystemMetrics(SM_CYSIZEFRAME) + padding};
}

bool OnAMonitor(const RECT& rc) {
    return ::MonitorFromRect(&rc, MONITOR_DEFAULTTONULL) != nullptr;
}

// The position of the last separator of a path ("\", "/" or the drive's ":"), or npos, found by character.
std::string::size_type LastSeparatorOrDrive(const std::string& path) {
    return LastCharacterOf(path, "\\/:");
}

} // namespace

FramePlacement PlaceFrame(const RECT& dialog, int width, int height) {
    FramePlacement place;
    // In 64 bits: stored sizes are whatever the settings file says.
    const long long left = dialog.left, top = dialog.top, right = dialog.right, bottom = dialog.bottom;
    long long x = (left + right) / 2 - width / 2;
    // The dialog's height is added to the frame's before halving; the frame opens that much higher.
    long long y = std::max(0LL, (top + bottom) / 2 - (height - top + bottom) / 2);
    x = std::max(x, 0LL);
    place.x = static_cast<int>(std::min<long long>(x, INT_MAX));
    place.y = static_cast<int>(std::min<long long>(y, INT_MAX));
    place.width = width;
    place.height = height;
    if (place.x == 0 && place.y == 0)
        place.maximised = true;
    else
        place.move = width != 0 && height != 0;
    return place;
}

bool StoredSizeUsable(int width, int height, const RECT& virtualScreen) {
    return width > 0 && height > 0 && width <= virtualScreen.right - virtualScreen.left &&
           height <= virtualScreen.bottom - virtualScreen.top;
}

FramePlacement PlaceFrameOnDesktop(const RECT& dialog, int width, int height, const RECT& virtualScreen,
                                   const std::function<bool(const RECT&)>& onMonitor, SIZE frameBorder) {
    const FramePlacement firstRun = PlaceFrame(dialog, 0, 0);
    const FramePlacement place = PlaceFrame(dialog, width, height);
    // A frame closed maximised stored its maximised rectangle, the screen and its borders: it opens
    // maximised again instead of at the created size. The run dialog's place decides that (x = y = 0);
    // when the host's window is off the screen's centre, a size that covers the whole screen does.
    const RECT withBorders{virtualScreen.left - frameBorder.cx, virtualScreen.top - frameBorder.cy,
                           virtualScreen.right + frameBorder.cx, virtualScreen.bottom + frameBorder.cy};
    const bool coversScreen = width >= virtualScreen.right - virtualScreen.left &&
                              height >= virtualScreen.bottom - virtualScreen.top;
    if ((place.maximised || coversScreen) && StoredSizeUsable(width, height, withBorders)) {
        FramePlacement maximised;
        maximised.maximised = true;
        maximised.width = width;
        maximised.height = height;
        return maximised;
    }
    if (!StoredSizeUsable(width, height, virtualScreen))
        return firstRun;
    if (!place.move)
        return place;
    // The caption's left end (system menu and title) must be on a screen, or the frame cannot be moved.
    const RECT caption{place.x, place.y, place.x + std::min(width, 120), place.y + std::min(height, 30)};
    if (onMonitor && !onMonitor(caption))
        return firstRun;
    return place;
}

std::string StartFolder(const std::string& startPath, const std::string& savedPath) {
    std::string folder;
    if (!startPath.empty()) {
        // Drive and folders: everything up to the last separator (no fixed buffer for a long path).
        const auto end = LastSeparatorOrDrive(startPath);
        folder = end == std::string::npos ? std::string() : startPath.substr(0, end + 1);
    } else {
        folder = savedPath;
    }
    // "C:\Work\" scans as "C:\Work"; a drive's root keeps its separator.
    while (folder.size() > 1 && EndsWithSeparator(folder) && !(folder.size() == 3 && folder[1] == ':'))
        folder.pop_back();
    return folder;
}

std::string SearchTextOf(const std::string& drawingName) {
    // The name stored in the settings file can be of any length: no fixed buffer.
    const auto separator = LastSeparatorOrDrive(drawingName);
    std::string name = separator == std::string::npos ? drawingName : drawingName.substr(separator + 1);
    const auto dot = name.rfind('.');
    if (dot != std::string::npos)
        name.erase(dot);
    return name;
}

bool CMdiMixin::SetUp(UINT frameResourceId) {
    m_nIDFrameResource = frameResourceId;
    return true;
}

CMainFrame* CMdiMixin::ExplorerFrame() const {
    return dynamic_cast<CMainFrame*>(CWnd::FromHandle(m_hExplorerFrame));
}

bool CMdiMixin::CreateAndShow(CDialog* dialog, const ExplorerCall& call) {
    // 1. The document reads the explorer's settings; it lives until the LISP function ends the run.
    auto* doc = new CTessel3Doc();
    // The drawing chosen in the last run and its folder, before the first folder shown drops them.
    const std::string saved = doc->m_strName;
    const std::string savedFolder = doc->m_strPath;
    m_pFolder = std::make_unique<DrawingFolder>(m_folderReader, doc);
    // 2. The frame deletes itself when its window is destroyed; its views are given the document, and it
    // speaks for the folder model while it stands.
    auto* frame = new CMainFrame(call, *m_pFolder);
    CCreateContext context;
    context.m_pCurrentDoc = doc;
    // 3. The host takes no input while the explorer is open.
    HWND hostFrame = call.hostFrame;
    if (hostFrame)
        ::EnableWindow(hostFrame, FALSE);
    // 4. The object is kept through a failed creation (its window may have come and gone) and freed here.
    frame->m_bAutoDelete = false;
    if (!frame->LoadFrame(m_nIDFrameResource, WS_OVERLAPPEDWINDOW | FWS_ADDTOTITLE, dialog, &context)) {
        if (hostFrame)
            ::EnableWindow(hostFrame, TRUE);
        delete frame;
        return false;
    }
    frame->m_bAutoDelete = true;
    m_hExplorerFrame = frame->m_hWnd;
    // 5. The posted accept and cancel messages go to the dialog.
    m_pMainWnd = dialog;
    frame->InitialUpdateFrame(doc, false);
    // The folder tree walks to the start folder once the grid has drawn its pictures (step 9); until then
    // it is hidden, and the grid shows the start folder by its path.
    CChildView* tree = frame->GetFolderTree();
    if (tree)
        tree->ShowWindow(SW_HIDE);
    if (CTessel3View* grid = frame->GetGridView())
        frame->SetActiveView(grid, false);

    // 6. Placement from the dialog's rectangle and the stored size, on a monitor of this desktop.
    const CRect rcDialog = dialog->GetWindowRect();
    const FramePlacement place = PlaceFrameOnDesktop(rcDialog, doc->m_nWindowWidth, doc->m_nWindowHeight,
                                                     VirtualScreen(), &OnAMonitor, SizingBorder());
    if (place.maximised) {
        frame->ShowWindow(SW_SHOWMAXIMIZED);
    } else {
        if (place.move)
            frame->MoveWindow(place.x, place.y, place.width, place.height);
        frame->ShowWindow(SW_SHOWNORMAL);
    }

    // 7. The start folder is scanned and laid out at the size the frame is shown at (a slow one goes on
    // while the frame shows it being read, and is laid out when it ends). The keyboard starts in
    // the tree (which selects nothing of its own before its walk); then the frame is drawn. Nothing is
    // chosen yet.
    const std::string scanProblem = ShowStartFolder(*m_pFolder, call.startPath, doc->m_strPath);
    if (tree)
        tree->SetFocus();
    frame->UpdateWindow();
    frame->EnablePick(false);

    // 8. The drawing of the last run is chosen again: its name starts the search, and the drawing itself is
    // selected (the search may have found another name first). It stays the current drawing, so accept
    // takes it; when the folder no longer holds it, nothing is chosen.
    // Only in the folder it was chosen in: another folder's drawing of the same name is another drawing.
    CEditSearch& search = frame->GetSearchEdit();
    if (m_pFolder->IsScanning()) {
        // A slow folder: chosen once it is read, unless the user went elsewhere meanwhile.
        if (!saved.empty() && DrawingFolder::SameFolder(savedFolder, m_pFolder->Folder()))
            frame->ChooseAfterScan(m_pFolder->Folder(), saved, SearchTextOf(saved));
    } else if (search.m_hWnd && !saved.empty() &&
               DrawingFolder::SameFolder(savedFolder, m_pFolder->Folder())) {
        search.SetWindowText(SearchTextOf(saved));
        if (CTessel3View* grid = frame->GetGridView())
            grid->ChooseDrawing(saved);
    }
    // Said last: the search above has its own message for the status bar.
    if (!scanProblem.empty())
        frame->SetMessageText(scanProblem);

    // 9. The pictures are up: the tree walks to the start folder, then opens it to show its sub-folders.
    // When it does not get there, the keyboard goes to the grid.
    if (tree)
        tree->WalkToStartLater();
    return true;
}
