// The test bench of the grid: a stand-in frame (a top-level window holding the grid view), the frame
// requests recorded, a host that counts preview paints, the message pump of the modal loop, key presses.
#pragma once

#include "framework/afxwin.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/DwgList.h"
#include "thumbs/Tessel3View.h"

#include <memory>
#include <string>
#include <vector>

// What the grid asked of the frame (through the view's handlers).
struct FrameRecord {
    int sortMode = 0;
    bool pickEnabled = false;
    int pickCalls = 0;
    std::string title;
    int statusUpdates = 0;
    std::string status;                // the status bar's message
    std::vector<std::string> toldUser; // message boxes the user would have seen
    int treeFocusRequests = 0;
    HWND frame = nullptr;
};
FrameRecord& Frame();

// Preview paints the host was asked for.
struct PaintRecord {
    int count = 0;
    std::vector<std::wstring> names;
    std::vector<HWND> windows;
    bool backgroundZero = true;
};
PaintRecord& Paints();
void InstallCountingHost();

// The application's main window: it receives the accept and cancel messages.
class MainWindow : public CWnd {
public:
    std::vector<WPARAM> results;

protected:
    LRESULT WindowProc(UINT message, WPARAM wParam, LPARAM lParam) override;
};
MainWindow& Main();

// A top-level frame whose client is the grid view.
class TestFrame : public CWnd {
public:
    // The view is given doc through its creation context.
    bool CreateFrame(int clientWidth, int clientHeight, CDocument* doc);
    CTessel3View* view = nullptr;
    std::vector<UINT> commands; // menu commands that reached the frame

protected:
    void OnSize(UINT type, int cx, int cy) override;
    bool OnCmdMsg(UINT id, int code) override;
};

// Dispatches everything queued, offering each message to PreTranslateMessage first, as the explorer's
// modal loop does.
void Pump();
// A key pressed on the window that has the focus: real input when the window is in the foreground,
// otherwise the same messages posted to the focus window; then pumped.
void PressKey(WORD vk);
// How many key presses went which way so far.
std::string KeyPressSummary();

// Errors the framework caught and reported during a bench's life.
std::vector<std::string>& Reports();

// Fills the drawing list with count records named d00000.dwg...
void FillList(int count);

// Live thumbnail windows (and labels) that are children of the view.
int LiveThumbnails(HWND view);
int LiveLabels(HWND view);

// A control's rectangle in the view's client coordinates.
CRect RectInView(HWND control, HWND view);

// The document, the frame and the view of one test.
class GridBench {
public:
    // settingsText: the explorer's settings file as the document reads it (none when empty).
    explicit GridBench(int clientWidth = 700, int clientHeight = 600, const std::string& settingsText = "");
    ~GridBench();
    GridBench(const GridBench&) = delete;
    GridBench& operator=(const GridBench&) = delete;
    CTessel3View& view(); // a frame without a view fails the test that asks (an exception gtest reports)
    TestFrame& frame() { return m_frame; }

private:
    std::string m_settings;
    std::unique_ptr<CTessel3Doc> m_doc;
    TestFrame m_frame;
};
