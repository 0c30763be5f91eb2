#include "GridTestSupport.h"

#include "hostapi/HostApi.h"
#include "tests/support/MessagePump.h"
#include "tests/support/TempFolder.h"
#include "thumbs/AppMessages.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <stdexcept>

// ---- the frame's side of the view's handlers, recorded ---------------------------------------------

FrameRecord& Frame() {
    static FrameRecord record;
    return record;
}

namespace {

void RecordPick(bool enable) {
    Frame().pickEnabled = enable;
    ++Frame().pickCalls;
}

void RecordFrameRequests(CTessel3View& view) {
    view.SetFolder(&Drawings());
    Drawings().onShown = [&view] {
        Frame().title = Drawings().Folder();
        RecordPick(false);
        ++Frame().statusUpdates;
        if (view.m_hWnd)
            view.Rebuild();
    };
    Drawings().onChosen = [] {
        const bool chosen = Drawings().Chosen() >= 0;
        Frame().title = chosen ? Drawings().ChosenPath() : Drawings().Folder();
        RecordPick(chosen);
    };
    view.SetFileCommands(&BenchFiles());
    view.onSortMode = [] { return Frame().sortMode; };
    view.onSort = [](int mode) { Frame().sortRequests.push_back(mode); };
    view.onGrowFrame = [](int widthChange, int heightChange) {
        CRect rc;
        ::GetWindowRect(Frame().frame, &rc);
        ::MoveWindow(Frame().frame, rc.left, rc.top, rc.Width() + widthChange, rc.Height() + heightChange,
                     TRUE);
    };
    view.onStatusText = [](const std::string& text) { Frame().status = text; };
    view.onTellUser = [](const std::string& text) { Frame().toldUser.push_back(text); };
    view.onFocusFolderTree = [] { ++Frame().treeFocusRequests; };
    view.onFocusPickButtons = [] { ++Frame().pickFocusRequests; };
}

} // namespace

int BenchFileCommands::Rename(const std::string& source, const std::string& destination) {
    calls.push_back("rename");
    return ::MoveFileA(source.c_str(), destination.c_str()) ? 0 : static_cast<int>(::GetLastError());
}

BenchFileCommands& BenchFiles() {
    static BenchFileCommands files;
    return files;
}

// ---- host ---------------------------------------------------------------------------------------------

void SettlePictures() {
    for (int i = 0; i < 10; ++i) {
        Pump();
        ::MsgWaitForMultipleObjects(0, nullptr, FALSE, 30, QS_ALLINPUT);
    }
    Pump();
}

PaintRecord& Paints() {
    static PaintRecord record;
    return record;
}

namespace {

bool CountingPreview(const wchar_t* fileName, HWND window, const std::uint32_t* bgColor) {
    PaintRecord& r = Paints();
    ++r.count;
    r.names.emplace_back(fileName ? fileName : L"");
    r.windows.push_back(window);
    if (!bgColor || *bgColor != 0)
        r.backgroundZero = false;
    return true;
}

} // namespace

void InstallCountingHost() {
    HostApi api{};
    api.acdbDisplayPreviewFromDwg = &CountingPreview;
    SetHostApi(api);
}

// ---- windows ------------------------------------------------------------------------------------------

LRESULT MainWindow::WindowProc(UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_ORVEX_RESULT) {
        results.push_back(wParam);
        return 0;
    }
    return CWnd::WindowProc(message, wParam, lParam);
}

MainWindow& Main() {
    static MainWindow main;
    if (!main.m_hWnd) {
        main.CreateEx(0, nullptr, "main", WS_POPUP, CRect(0, 0, 10, 10), nullptr, 0);
        if (CWinApp* app = AfxGetApp())
            app->m_pMainWnd = &main;
    }
    return main;
}

bool TestFrame::CreateFrame(int clientWidth, int clientHeight, CDocument* doc) {
    RECT rc{0, 0, clientWidth, clientHeight};
    ::AdjustWindowRectEx(&rc, WS_OVERLAPPEDWINDOW, FALSE, 0);
    if (!CreateEx(0, nullptr, "grid", WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN,
                  CRect(20, 20, 20 + rc.right - rc.left, 20 + rc.bottom - rc.top), nullptr, 0))
        return false;
    view = new CTessel3View; // deletes itself with its window
    RecordFrameRequests(*view);
    CCreateContext context;
    context.m_pCurrentDoc = doc;
    if (!view->Create(nullptr, nullptr, WS_CHILD | WS_VISIBLE, CRect(0, 0, clientWidth, clientHeight), this,
                      0xE900, &context))
        return false;
    view->OnInitialUpdate();
    ShowWindow(SW_SHOW);
    UpdateWindow();
    ::SetForegroundWindow(m_hWnd);
    view->SetFocus();
    return true;
}

void TestFrame::OnSize(UINT type, int cx, int cy) {
    Default();
    if (view && view->m_hWnd)
        view->MoveWindow(0, 0, cx, cy);
}

bool TestFrame::OnCmdMsg(UINT id, int code) {
    commands.push_back(id);
    return true;
}

void Pump() {
    testsupport::PumpMessages(testsupport::Chars::Narrow,
                              [](MSG* msg) { return AfxPreTranslateMessage(msg); });
}

namespace {

int g_realKeys = 0;
int g_postedKeys = 0;
// Set once a real key got lost (another program took the foreground): post from then on.
bool g_realLost = false;

bool SendRealKey(WORD vk) {
    INPUT in[2] = {};
    in[0].type = INPUT_KEYBOARD;
    in[0].ki.wVk = vk;
    in[1] = in[0];
    in[1].ki.dwFlags = KEYEVENTF_KEYUP;
    if (::SendInput(2, in, sizeof(INPUT)) != 2)
        return false;
    // The input reaches the queue asynchronously: wait for the key up, then let the loop handle both.
    for (int i = 0; i < 200; ++i) {
        MSG msg;
        if (::PeekMessageA(&msg, nullptr, WM_KEYUP, WM_KEYUP, PM_NOREMOVE))
            return true;
        ::MsgWaitForMultipleObjects(0, nullptr, FALSE, 5, QS_ALLINPUT);
    }
    return false;
}

} // namespace

std::string KeyPressSummary() {
    return std::to_string(g_realKeys) + " key presses through the input queue (SendInput), " +
           std::to_string(g_postedKeys) + " posted to the focus window";
}

void PressKey(WORD vk) {
    // Real input only while one of our windows is in the foreground: the Wine server may be shared with
    // other programs, whose windows must not receive our keys.
    HWND focus = ::GetFocus();
    const bool foreground = focus && ::GetForegroundWindow() == ::GetAncestor(focus, GA_ROOT);
    if (foreground && !g_realLost && SendRealKey(vk)) {
        ++g_realKeys;
    } else {
        if (foreground && !g_realLost)
            g_realLost = true;
        ++g_postedKeys;
        ::PostMessageA(focus, WM_KEYDOWN, vk, 1);
        ::PostMessageA(focus, WM_KEYUP, vk, static_cast<LPARAM>(0xC0000001));
    }
    Pump();
}

// ---- list and windows ---------------------------------------------------------------------------------

namespace {

// Lists drawings held in memory, or a real folder.
struct BenchReader : FolderReader {
    int count = 0;
    bool real = false;
    FileSystemFolderReader files;

    bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem,
              ScanProgress& progress) override {
        if (real)
            return files.Read(folder, drawings, problem, progress);
        for (int i = 0; i < count; ++i) {
            DwgFindEntry e;
            char name[32];
            std::snprintf(name, sizeof name, "d%05d.dwg", i);
            e.name = name;
            e.timeWrite = 1600000000 + i;
            e.size = static_cast<std::uint64_t>(1000 + i);
            drawings.emplace_back(std::move(e));
        }
        return true;
    }
    void MakeCurrentDirectory(const std::string&) override {}
};

BenchReader& Reader() {
    static BenchReader reader;
    return reader;
}

std::string CurrentDirectoryName() {
    char buffer[MAX_PATH] = {};
    const DWORD n = ::GetCurrentDirectoryA(MAX_PATH, buffer);
    return std::string(buffer, n < MAX_PATH ? n : 0);
}

} // namespace

namespace {
DrawingFolder* g_drawings = nullptr; // the folder model of the bench standing
} // namespace

DrawingFolder& Drawings() {
    if (!g_drawings)
        throw std::runtime_error("no grid bench stands: no folder model");
    return *g_drawings;
}

void FillList(int count, const std::string& folder) {
    Reader().real = false;
    Reader().count = count;
    Drawings().Show(folder.empty() ? CurrentDirectoryName() : folder);
}

bool ShowFolder(const std::string& path) {
    Reader().real = true;
    return Drawings().Show(path);
}

namespace {

struct ChildCount {
    const char* className;
    int count;
};

// Every window of the class inside the view (the controls sit on the view's sheet).
BOOL CALLBACK CountChild(HWND hwnd, LPARAM lParam) {
    auto* c = reinterpret_cast<ChildCount*>(lParam);
    char name[64] = {};
    ::GetClassNameA(hwnd, name, sizeof name);
    if (::lstrcmpiA(name, c->className) == 0)
        ++c->count;
    return TRUE;
}

} // namespace

int LiveThumbnails(HWND view) {
    ChildCount c{AFX_WND_CLASS, 0};
    ::EnumChildWindows(view, CountChild, reinterpret_cast<LPARAM>(&c));
    return c.count;
}

int LiveLabels(HWND view) {
    ChildCount c{"Edit", 0};
    ::EnumChildWindows(view, CountChild, reinterpret_cast<LPARAM>(&c));
    return c.count;
}

CRect RectInView(HWND control, HWND view) {
    CRect rc;
    ::GetWindowRect(control, &rc);
    ::MapWindowPoints(nullptr, view, reinterpret_cast<POINT*>(&rc), 2);
    return rc;
}

// ---- bench --------------------------------------------------------------------------------------------

namespace {
void RecordReport(const char* text) {
    Reports().emplace_back(text ? text : "");
}
} // namespace

std::vector<std::string>& Reports() {
    static std::vector<std::string> reports;
    return reports;
}

GridBench::GridBench(int clientWidth, int clientHeight, const std::string& settingsText) {
    // A caught error must not wait in a message box.
    AfxSetErrorReporter(&RecordReport);
    Reports().clear();
    InstallCountingHost();
    Main().results.clear();
    Frame() = FrameRecord{};
    Paints() = PaintRecord{};
    static const testsupport::TempFolder scratch("orvex-grid"); // one for the program, removed at its end
    m_settings = scratch.File("orvex-grid-test.ini");
    ::DeleteFileA(m_settings.c_str());
    if (!settingsText.empty()) {
        if (FILE* f = std::fopen(m_settings.c_str(), "wb")) {
            std::fwrite(settingsText.data(), 1, settingsText.size(), f);
            std::fclose(f);
        }
    }
    m_doc = std::make_unique<CTessel3Doc>(m_settings);
    Reader().count = 0;
    Reader().real = false;
    m_drawings = std::make_unique<DrawingFolder>(Reader(), m_doc.get());
    g_drawings = m_drawings.get();
    m_frame.CreateFrame(clientWidth, clientHeight, m_doc.get());
    Frame().frame = m_frame.m_hWnd;
    Pump();
}

CTessel3View& GridBench::view() {
    if (!m_frame.view)
        throw std::runtime_error("the test frame has no grid view");
    return *m_frame.view;
}

GridBench::~GridBench() {
    m_frame.DestroyWindow(); // the view goes with it and deletes itself
    Pump();
    Frame().frame = nullptr;
    g_drawings = nullptr;
    m_drawings.reset(); // it writes to the document: it goes first
    m_doc.reset();
    ::DeleteFileA(m_settings.c_str());
    DwgList.RemoveAll();
    for (const std::string& report : Reports())
        ADD_FAILURE() << "reported error: " << report;
}
