#include "frame/MdiMixin.h"

#include "frame/FolderPaneLink.h"
#include "frame/GridLink.h"
#include "frame/MainFrame.h"
#include "host/HostApi.h"
#include "host/Orvex.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"

#include "res/resource.h"

#include <algorithm>
#include <cstdlib>

namespace {

// Shows the folder the explorer starts in: scans it into the drawing list, makes it the current folder
// and lays the grid out.
void ShowStartFolder(CMainFrame& frame, CTessel3Doc& doc) {
    const std::string folder = StartFolder(g_szStartPath, doc.m_strPath);
    if (folder.empty())
        return;
    ScanFolderPath(folder.c_str(), ".dwg");
    doc.m_strPath = folder;
    RebuildGrid();
    frame.UpdateLayerLabel();
}

} // namespace

FramePlacement PlaceFrame(const RECT& dialog, int width, int height) {
    FramePlacement place;
    const int left = dialog.left, top = dialog.top, right = dialog.right, bottom = dialog.bottom;
    place.x = (left + right) / 2 - width / 2;
    // The dialog's height is added to the frame's before halving; the frame opens that much higher.
    place.y = std::max(0, (top + bottom) / 2 - (height - top + bottom) / 2);
    place.x = std::max(place.x, 0);
    if (place.x == 0 && place.y == 0)
        place.maximised = true;
    else
        place.move = width != 0 && height != 0;
    return place;
}

std::string StartFolder(const std::string& startPath, const std::string& savedPath) {
    std::string folder;
    if (!startPath.empty()) {
        char drive[_MAX_DRIVE] = "", dir[_MAX_DIR] = "";
        _splitpath(startPath.c_str(), drive, dir, nullptr, nullptr);
        folder = std::string(drive) + dir;
    } else {
        folder = savedPath;
    }
    // "C:\Work\" scans as "C:\Work"; a drive's root keeps its separator.
    while (folder.size() > 1 && (folder.back() == '\\' || folder.back() == '/') &&
           !(folder.size() == 3 && folder[1] == ':'))
        folder.pop_back();
    return folder;
}

std::string SearchTextOf(const std::string& drawingName) {
    char fname[_MAX_FNAME] = "";
    _splitpath(drawingName.c_str(), nullptr, nullptr, fname, nullptr);
    return fname;
}

bool CMdiMixin::SetUp(UINT frameResourceId) {
    m_nIDFrameResource = frameResourceId;
    return true;
}

bool CMdiMixin::CreateAndShow(CDialog* dialog) {
    // 1. The document reads the explorer's settings; it lives until the LISP function ends the run.
    auto* doc = new CTessel3Doc();
    // 2. The frame deletes itself when its window is destroyed.
    auto* frame = new CMainFrame();
    // 3. The host takes no input while the explorer is open.
    HWND hostFrame = acedGetAcadFrame();
    if (hostFrame)
        ::EnableWindow(hostFrame, FALSE);
    // 4. The object is kept through a failed creation (its window may have come and gone) and freed here.
    frame->m_bAutoDelete = false;
    if (!frame->LoadFrame(m_nIDFrameResource, WS_OVERLAPPEDWINDOW | FWS_ADDTOTITLE, dialog, nullptr)) {
        if (hostFrame)
            ::EnableWindow(hostFrame, TRUE);
        delete frame;
        return false;
    }
    frame->m_bAutoDelete = true;
    // 5. The posted accept and cancel messages go to the dialog.
    m_pMainWnd = dialog;
    frame->InitialUpdateFrame(doc, false);
    // Without the folder tree to pick it, the grid shows the start folder.
    if (!HasFolderTree())
        ShowStartFolder(*frame, *doc);

    // 6. Placement from the dialog's rectangle and the stored size.
    const CRect rcDialog = dialog->GetWindowRect();
    const FramePlacement place = PlaceFrame(rcDialog, doc->m_nWindowWidth, doc->m_nWindowHeight);
    if (place.maximised) {
        frame->ShowWindow(SW_SHOWMAXIMIZED);
    } else {
        if (place.move)
            frame->MoveWindow(place.x, place.y, doc->m_nWindowWidth, doc->m_nWindowHeight);
        frame->ShowWindow(SW_SHOWNORMAL);
    }

    // 7. The folder tree shows its current folder again and takes the focus.
    ReselectFolderTree();

    // 8. Nothing is chosen yet.
    frame->UpdateWindow();
    frame->EnablePick(false);

    // 9. The drawing of the last run starts the search; the name is chosen anew.
    CEditSearch& search = frame->GetSearchEdit();
    if (search.m_hWnd && !doc->m_strName.empty())
        search.SetWindowText(SearchTextOf(doc->m_strName));
    doc->m_strName.clear();
    return true;
}
