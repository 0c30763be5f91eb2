// The test bench of the grid: a stand-in frame (a top-level window holding the grid view), the frame
// requests recorded, a host that counts preview paints, the message pump of the modal loop, key presses.
#pragma once

#include "framework/afxwin.h"
#include "settings/Tessel3Doc.h"
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "thumbs/Tessel3View.h"

#include <memory>
#include <string>
#include <vector>

// What the grid asked of the frame (through the view's handlers), and what the frame made of the folder
// model's news (as the explorer's frame does: title, pick, a count of folders shown).
struct FrameRecord {
    int sortMode = 0;
    bool pickEnabled = false;
    int pickCalls = 0;
    std::string title;
    int statusUpdates = 0;
    std::string status;                // the status bar's message
    std::vector<std::string> toldUser; // message boxes the user would have seen
    int treeFocusRequests = 0;
    int pickFocusRequests = 0;
    std::vector<int> sortRequests; // sorts chosen in a thumbnail's menu
    HWND frame = nullptr;
};
FrameRecord& Frame();

// The bench's file commands: a rename moves the file (as the shell would, without its questions); the
// others are recorded.
struct BenchFileCommands : GridFileCommands {
    std::vector<std::string> calls;
    bool ClipboardHoldsDrawings() override { return false; }
    void Copy(const std::vector<std::string>&, bool cut) override { calls.push_back(cut ? "cut" : "copy"); }
    int Paste(const std::string&) override {
        calls.push_back("paste");
        return kFileCommandNotDone;
    }
    int Delete(const std::vector<std::string>&) override {
        calls.push_back("delete");
        return 0;
    }
    int Rename(const std::string& source, const std::string& destination) override;
    void ShowProperties(const std::string& path) override { calls.push_back("properties " + path); }
};
BenchFileCommands& BenchFiles();

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
// Pumps for a while, resting between rounds: the picture loader's workers hand their pictures over.
void SettlePictures();
// A key pressed on the window that has the focus: real input when the window is in the foreground,
// otherwise the same messages posted to the focus window; then pumped.
void PressKey(WORD vk);
// How many key presses went which way so far.
std::string KeyPressSummary();

// Errors the framework caught and reported during a bench's life.
std::vector<std::string>& Reports();

// The folder model the standing bench's grid shows (the explorer has one for a call).
DrawingFolder& Drawings();
// Shows folder holding count drawings named d00000.dwg... (listed in memory; the folder's name is the
// process's current directory unless given).
void FillList(int count, const std::string& folder = std::string());
// Shows the real folder at path, read by the runtime's file search.
bool ShowFolder(const std::string& path);

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
    std::unique_ptr<DrawingFolder> m_drawings;
    TestFrame m_frame;
};
