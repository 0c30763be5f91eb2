// The application object's part that opens the explorer: set up once with the frame's resource id,
// then asked by the run dialog to create and show the explorer for one call of the LISP function.
#pragma once

#include "frame/ExplorerCall.h"
#include "framework/afxwin.h"
#include "thumbs/DrawingFolder.h"

#include <functional>
#include <memory>
#include <string>

class CMainFrame;

class CMdiMixin : public CWinApp {
public:
    CMdiMixin() = default;

    // Keeps the frame's resource id for later; no window is made here.
    bool SetUp(UINT frameResourceId);

    // Creates the explorer document and the frame for `dialog`, the run dialog whose modal loop hosts
    // them, with the arguments of the call. Returns true when the explorer stands. The host's main frame
    // stays disabled until the dialog's modal run ends (the run enables its owner again).
    bool CreateAndShow(CDialog* dialog, const ExplorerCall& call);

    UINT FrameResourceId() const { return m_nIDFrameResource; }
    // The explorer frame while its window exists, else nullptr.
    CMainFrame* ExplorerFrame() const;
    // The folder model of the call: made with the explorer, kept after its windows are gone (the LISP
    // function reads the chosen drawing from it) until EndRun. nullptr outside a call.
    DrawingFolder* Folder() const { return m_pFolder.get(); }
    // The call is over: the folder model goes, before the document it writes to.
    void EndRun() { m_pFolder.reset(); }

private:
    UINT m_nIDFrameResource = 0;
    FileSystemFolderReader m_folderReader;
    std::unique_ptr<DrawingFolder> m_pFolder;
    HWND m_hExplorerFrame = nullptr; // looked up again each time: the frame deletes itself with its window
};

// Where the frame is put for the run dialog's screen rectangle and the stored frame size.
struct FramePlacement {
    bool maximised = false;
    bool move = false; // move to x, y with width x height
    int x = 0;
    int y = 0;
    int width = 0;
    int height = 0;
};
FramePlacement PlaceFrame(const RECT& dialog, int width, int height);

// A stored frame size the desktop can show: both sides positive and none larger than the virtual screen.
bool StoredSizeUsable(int width, int height, const RECT& virtualScreen);
// The placement on this desktop: a stored size it cannot show, or a frame whose caption would lie on no
// monitor (onMonitor says whether a screen rectangle touches one), is placed as on a first run, as if no
// size had been stored. A maximised frame's rectangle reaches past the screen by its sizing border
// (frameBorder on each side): such a stored size, placed at x = y = 0 or covering the whole screen,
// opens maximised again.
FramePlacement PlaceFrameOnDesktop(const RECT& dialog, int width, int height, const RECT& virtualScreen,
                                   const std::function<bool(const RECT&)>& onMonitor,
                                   SIZE frameBorder = SIZE{0, 0});

// The folder the grid shows first: the folder part of the start path, else the saved current folder.
std::string StartFolder(const std::string& startPath, const std::string& savedPath);

// The file-name part of a drawing name (no folder, no extension): what the search edit starts with.
std::string SearchTextOf(const std::string& drawingName);
