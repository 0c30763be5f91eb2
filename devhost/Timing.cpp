#include "devhost/Timing.h"

#include "devhost/FileDelay.h"
#include "devhost/HostObjects.h"
#include "devhost/ImportPatch.h"
#include "devhost/Output.h"

#include <atomic>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <cwchar>
#include <string>

namespace devhost {
namespace {

// A window that has had a preview drawn carries this property; it goes with the window.
const wchar_t kDrawnProperty[] = L"DevhostPreviewDrawn";
// A window whose first WM_PAINT was marked carries this one.
const wchar_t kPaintedProperty[] = L"DevhostPainted";

LARGE_INTEGER g_start{};
LARGE_INTEGER g_frequency{};
HHOOK g_hook = nullptr;
HHOOK g_cbtHook = nullptr;
HHOOK g_sentHook = nullptr;
bool g_afterKey = false;
std::atomic<bool> g_inCall{false}; // read by the script thread too (input marks)
long g_scanEntries = 0;
DWORD g_uiThread = 0;

// Time devhost spends measuring (counting windows, writing lines) inside the call: left out of every
// time printed, so that the lines show the library's time and the host's drawing, not the benchmark's.
LONGLONG g_overhead = 0;

LONGLONG Now() {
    LARGE_INTEGER now;
    QueryPerformanceCounter(&now);
    return now.QuadPart;
}

// The moment the outermost measuring began, while one goes on (0: none).
LONGLONG g_measuringBegan = 0;
int g_measuringDepth = 0;

// Inside a measuring, the moment it began: its own time is left out of the lines it writes too, so a
// line written after it never shows an earlier time than one written in it.
double Elapsed() {
    const LONGLONG now = g_measuringDepth > 0 ? g_measuringBegan : Now();
    return static_cast<double>(now - g_start.QuadPart - g_overhead) * 1000.0 /
           static_cast<double>(g_frequency.QuadPart);
}

// Held while the user-interface thread measures and while another thread (the library's scan) takes its
// time and writes its line: a time taken in the middle of a measuring would have that measuring's
// overhead left in, and come out after a later line of the user-interface thread.
struct LineOrder {
    CRITICAL_SECTION section;
    LineOrder() { InitializeCriticalSection(&section); }
    ~LineOrder() { DeleteCriticalSection(&section); }
};
LineOrder g_lineOrder;

// Adds the time from its construction to its destruction to the overhead.
// Nested ones count once, from the outermost.
class Overhead {
public:
    Overhead() {
        EnterCriticalSection(&g_lineOrder.section);
        if (g_measuringDepth++ == 0)
            g_measuringBegan = Now();
    }
    Overhead(const Overhead&) = delete;
    Overhead& operator=(const Overhead&) = delete;
    ~Overhead() {
        if (--g_measuringDepth == 0) {
            g_overhead += Now() - g_measuringBegan;
            g_measuringBegan = 0;
        }
        LeaveCriticalSection(&g_lineOrder.section);
    }
};

void Line(double ms, const std::wstring& what) {
    wchar_t number[32];
    std::swprintf(number, sizeof number / sizeof number[0], L"%.3f", ms);
    WriteLine(L"[timing] " + std::wstring(number) + L" " + what);
}

std::wstring ClassOf(HWND window) {
    wchar_t className[128] = L"-";
    if (window)
        GetClassNameW(window, className, 128);
    return className;
}

// The first WM_PAINT of a window, however it comes: from the queue, or sent by UpdateWindow or a
// redraw while the library works.
void FirstPaint(HWND window, const wchar_t* how) {
    if (!window || GetPropW(window, kPaintedProperty))
        return;
    SetPropW(window, kPaintedProperty, reinterpret_cast<HANDLE>(1));
    Line(Elapsed(), L"paint " + ClassOf(window) + how);
}

LRESULT CALLBACK SentMessageHook(int code, WPARAM sentByThread, LPARAM data) {
    if (code == HC_ACTION && g_inCall) {
        const auto* message = reinterpret_cast<const CWPSTRUCT*>(data);
        if (message->message == WM_PAINT) {
            Overhead measuring;
            try {
                FirstPaint(message->hwnd, L" (sent)");
            } catch (...) {
            }
        }
    }
    return CallNextHookEx(g_sentHook, code, sentByThread, data);
}

// Sees every message the user-interface thread takes from its queue, whoever's loop takes it.
LRESULT CALLBACK GetMessageHook(int code, WPARAM removal, LPARAM data) {
    if (code == HC_ACTION && removal == PM_REMOVE && g_inCall) {
        Overhead measuring;
        try {
            const MSG* message = reinterpret_cast<const MSG*>(data);
            if (g_afterKey) {
                g_afterKey = false;
                Line(Elapsed(), L"key-handled");
            }
            if (message->message == WM_PAINT)
                FirstPaint(message->hwnd, L"");
            if (message->message == WM_KEYDOWN) {
                Line(Elapsed(), L"opened " + std::to_wstring(DrawingFilesOpened()));
                Line(Elapsed(), L"key " + std::to_wstring(message->wParam));
                g_afterKey = true;
            }
        } catch (...) {
            // out of memory while writing the line: the line is lost, the message goes on
        }
    }
    return CallNextHookEx(g_hook, code, removal, data);
}

// Sees every window the user-interface thread creates during a call, before its first message: the
// library's frame, bars, panes, thumbnails and tooltips, in the order they are made.
LRESULT CALLBACK CreateWindowHook(int code, WPARAM wParam, LPARAM lParam) {
    if ((code == HCBT_ACTIVATE || code == HCBT_MINMAX || code == HCBT_SETFOCUS) && g_inCall) {
        Overhead measuring;
        try {
            const HWND window = reinterpret_cast<HWND>(wParam);
            if (code == HCBT_ACTIVATE)
                Line(Elapsed(), L"activate " + ClassOf(window));
            else if (code == HCBT_SETFOCUS)
                Line(Elapsed(),
                     L"focus " + ClassOf(window) + L" from " + ClassOf(reinterpret_cast<HWND>(lParam)));
            else
                Line(Elapsed(), L"show " + ClassOf(window) + L" " + std::to_wstring(LOWORD(lParam)));
        } catch (...) {
        }
    }
    if (code == HCBT_CREATEWND && g_inCall) {
        Overhead measuring;
        try {
            const double ms = Elapsed();
            wchar_t className[128] = L"";
            GetClassNameW(reinterpret_cast<HWND>(wParam), className, 128);
            const auto* create = reinterpret_cast<const CBT_CREATEWNDW*>(lParam);
            wchar_t parentClass[128] = L"-";
            if (create->lpcs->hwndParent)
                GetClassNameW(create->lpcs->hwndParent, parentClass, 128);
            Line(ms, L"create " + std::wstring(className) + L" in " + parentClass);
        } catch (...) {
            // out of memory while writing the line: the line is lost, the window is made
        }
    }
    return CallNextHookEx(g_cbtHook, code, wParam, lParam);
}

// The library's own calls of a few system functions, seen through its import table (patched when the
// library is loaded): looking for and opening its settings files, and scanning a folder. Nothing in the
// library changes; devhost's functions below call the system's and only print a line around them.
using CreateFileAFn = HANDLE(WINAPI*)(LPCSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE);
using GetFileAttributesAFn = DWORD(WINAPI*)(LPCSTR);
using FindFirstFn = std::intptr_t(__cdecl*)(const char*, void*);
using FindNextFn = int(__cdecl*)(std::intptr_t, void*);
using FindCloseFn = int(__cdecl*)(std::intptr_t);
CreateFileAFn g_createFileA = nullptr;
GetFileAttributesAFn g_getFileAttributesA = nullptr;
FindFirstFn g_findFirst = nullptr;
FindNextFn g_findNext = nullptr;
FindCloseFn g_findClose = nullptr;

std::wstring Widen(const char* text) {
    std::wstring wide;
    for (; text && *text; ++text)
        wide += static_cast<wchar_t>(static_cast<unsigned char>(*text));
    return wide;
}

const char* LastComponent(const char* path) {
    const char* last = path;
    for (const char* p = path; *p; ++p)
        if (*p == '\\' || *p == '/')
            last = p + 1;
    return last;
}

// Settings files: the library's own and the drawing insertion settings, "*.ini".
bool IsSettingsFile(const char* name) {
    const std::size_t length = name ? std::strlen(name) : 0;
    return length > 4 &&
           CompareStringOrdinal(Widen(name + length - 4).c_str(), 4, L".ini", 4, TRUE) == CSTR_EQUAL;
}

DWORD WINAPI TimedGetFileAttributesA(LPCSTR name) {
    const bool settings = g_inCall && IsSettingsFile(name);
    const double before = settings ? Elapsed() : 0.0;
    const DWORD attributes = g_getFileAttributesA(name);
    if (settings) {
        Overhead measuring;
        try {
            Line(before, L"settings-look " + Widen(LastComponent(name)));
        } catch (...) {
        }
    }
    return attributes;
}

HANDLE WINAPI TimedCreateFileA(LPCSTR name, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security,
                               DWORD disposition, DWORD flags, HANDLE templateFile) {
    const bool reading =
        g_inCall && IsSettingsFile(name) && (access & GENERIC_READ) && !(access & GENERIC_WRITE);
    const double before = reading ? Elapsed() : 0.0;
    HANDLE file = g_createFileA(name, access, share, security, disposition, flags, templateFile);
    if (reading) {
        Overhead measuring;
        try {
            Line(before, L"settings-open " + Widen(LastComponent(name)));
        } catch (...) {
        }
    }
    return file;
}

std::intptr_t __cdecl TimedFindFirst(const char* pattern, void* found) {
    if (g_inCall) {
        Overhead measuring;
        try {
            Line(Elapsed(), L"scan-begin " + Widen(pattern));
        } catch (...) {
        }
    }
    g_scanEntries = 0;
    const std::intptr_t search = g_findFirst(pattern, found);
    if (search != -1)
        ++g_scanEntries;
    return search;
}

int __cdecl TimedFindNext(std::intptr_t search, void* found) {
    const int result = g_findNext(search, found);
    if (result == 0)
        ++g_scanEntries;
    return result;
}

int __cdecl TimedFindClose(std::intptr_t search) {
    const int result = g_findClose(search);
    if (g_inCall) {
        Overhead measuring;
        try {
            Line(Elapsed(), L"scan-end " + std::to_wstring(g_scanEntries) + L" entries");
        } catch (...) {
        }
    }
    return result;
}

// The folder scan's wide search. The pick's check of a name (FindFirstFileW) goes through FindNextFileW
// and FindClose too: only the search FindFirstFileExW began is counted. The scan runs on a thread of the
// library's own when it is slow: its lines take no part in the user-interface thread's overhead.
using FindFirstExWFn = HANDLE(WINAPI*)(LPCWSTR, FINDEX_INFO_LEVELS, LPVOID, FINDEX_SEARCH_OPS, LPVOID, DWORD);
using FindNextWFn = BOOL(WINAPI*)(HANDLE, LPWIN32_FIND_DATAW);
using FindCloseWFn = BOOL(WINAPI*)(HANDLE);
FindFirstExWFn g_findFirstExW = nullptr;
FindNextWFn g_findNextW = nullptr;
FindCloseWFn g_findCloseW = nullptr;
HANDLE volatile g_wideScan = INVALID_HANDLE_VALUE;
volatile LONG g_wideScanEntries = 0;

void ScanLine(const std::wstring& what) {
    if (!g_inCall)
        return;
    try {
        if (GetCurrentThreadId() == g_uiThread) {
            Overhead measuring;
            Line(Elapsed(), what);
        } else {
            EnterCriticalSection(&g_lineOrder.section);
            try {
                Line(Elapsed(), what);
            } catch (...) {
            }
            LeaveCriticalSection(&g_lineOrder.section);
        }
    } catch (...) {
    }
}

HANDLE WINAPI TimedFindFirstFileExW(LPCWSTR pattern, FINDEX_INFO_LEVELS level, LPVOID found,
                                    FINDEX_SEARCH_OPS search, LPVOID filter, DWORD flags) {
    ScanLine(L"scan-begin " + std::wstring(pattern ? pattern : L""));
    const HANDLE handle = g_findFirstExW(pattern, level, found, search, filter, flags);
    InterlockedExchange(&g_wideScanEntries, handle != INVALID_HANDLE_VALUE ? 1 : 0);
    g_wideScan = handle;
    return handle;
}

BOOL WINAPI TimedFindNextFileW(HANDLE handle, LPWIN32_FIND_DATAW found) {
    const BOOL result = g_findNextW(handle, found);
    if (result && handle == g_wideScan)
        InterlockedIncrement(&g_wideScanEntries);
    return result;
}

BOOL WINAPI TimedFindCloseW(HANDLE handle) {
    const bool scan = handle != INVALID_HANDLE_VALUE && handle == g_wideScan;
    const BOOL result = g_findCloseW(handle);
    if (scan) {
        g_wideScan = INVALID_HANDLE_VALUE;
        ScanLine(L"scan-end " + std::to_wstring(g_wideScanEntries) + L" entries");
    }
    return result;
}

using SetDIBitsToDeviceFn = int(WINAPI*)(HDC, int, int, DWORD, DWORD, int, int, UINT, UINT, const VOID*,
                                         const BITMAPINFO*, UINT);
SetDIBitsToDeviceFn g_setDIBitsToDevice = nullptr;

// The name shown under a thumbnail: the label a person reads there (a sibling edit just below it).
std::wstring LabelUnder(HWND thumbnail) {
    HWND parent = GetParent(thumbnail);
    if (!parent)
        return std::wstring();
    RECT rc;
    GetWindowRect(thumbnail, &rc);
    POINT below{(rc.left + rc.right) / 2, rc.bottom + 4};
    ScreenToClient(parent, &below);
    HWND label = ChildWindowFromPointEx(parent, below, CWP_SKIPINVISIBLE | CWP_SKIPTRANSPARENT);
    wchar_t className[32] = L"";
    if (!label || label == parent || !GetClassNameW(label, className, 32) ||
        lstrcmpiW(className, L"Edit") != 0)
        return std::wstring();
    wchar_t text[MAX_PATH] = L"";
    GetWindowTextW(label, text, MAX_PATH);
    return text;
}

// name: the file drawn, or nullptr to read the label under the window (counted as measuring).
void PreviewShown(HWND window, const std::wstring* name);

// The library painting a picture it keeps in memory into a window: a picture on the screen, as when the
// host's preview operation draws one.
int WINAPI TimedSetDIBitsToDevice(HDC dc, int x, int y, DWORD width, DWORD height, int sourceX, int sourceY,
                                  UINT startScan, UINT lines, const VOID* bits, const BITMAPINFO* info,
                                  UINT use) {
    const int done =
        g_setDIBitsToDevice(dc, x, y, width, height, sourceX, sourceY, startScan, lines, bits, info, use);
    if (done > 0 && g_inCall && GetCurrentThreadId() == g_uiThread) {
        try {
            HWND window = WindowFromDC(dc);
            if (window)
                PreviewShown(window, nullptr);
        } catch (...) {
        }
    }
    return done;
}

// --timing's watch of the user-interface thread from outside: a thread of devhost's sends WM_NULL to the
// explorer's frame every 10 ms and keeps the longest time one went unanswered.
struct Pinger {
    volatile LONG stop = 0;
    volatile LONG longestMicro = 0;
    DWORD uiThread = 0;
};
Pinger* g_pinger = nullptr;

BOOL CALLBACK FindExplorer(HWND window, LPARAM found) {
    wchar_t className[16] = L"";
    if (IsWindowVisible(window) && GetClassNameW(window, className, 16) &&
        std::wcsncmp(className, L"Orvex1:", 7) == 0) {
        *reinterpret_cast<HWND*>(found) = window;
        return FALSE;
    }
    return TRUE;
}

DWORD WINAPI PingExplorer(void* parameter) {
    Pinger* pinger = static_cast<Pinger*>(parameter);
    LARGE_INTEGER frequency;
    QueryPerformanceFrequency(&frequency);
    while (!pinger->stop) {
        HWND explorer = nullptr;
        EnumThreadWindows(pinger->uiThread, &FindExplorer, reinterpret_cast<LPARAM>(&explorer));
        if (explorer) {
            const LONGLONG begin = Now();
            DWORD_PTR answer = 0;
            SendMessageTimeoutW(explorer, WM_NULL, 0, 0, SMTO_NORMAL, 120000, &answer);
            const LONGLONG micro = (Now() - begin) * 1000000 / frequency.QuadPart;
            if (!pinger->stop && micro > pinger->longestMicro)
                InterlockedExchange(&pinger->longestMicro, static_cast<LONG>(micro));
        }
        Sleep(10);
    }
    // The call's end took the figure; the pinger is devhost's, freed by its own thread.
    delete pinger;
    return 0;
}

struct VisibleCount {
    HWND parent = nullptr;
    wchar_t className[128] = {};
    int visible = 0;
    int drawn = 0;
};

// Whether any part of the window shows: its rectangle cut by the client area of each window it lies in,
// up to its top-level window (a control can sit on a child window larger than what shows of it).
bool ShowsOnScreen(HWND window) {
    RECT shown;
    GetWindowRect(window, &shown);
    for (HWND outer = GetParent(window); outer && (GetWindowLongW(window, GWL_STYLE) & WS_CHILD);
         window = outer, outer = GetParent(outer)) {
        RECT client;
        GetClientRect(outer, &client);
        MapWindowPoints(outer, nullptr, reinterpret_cast<POINT*>(&client), 2);
        if (!IntersectRect(&shown, &shown, &client))
            return false;
    }
    return true;
}

BOOL CALLBACK CountSibling(HWND window, LPARAM data) {
    VisibleCount& count = *reinterpret_cast<VisibleCount*>(data);
    if (GetParent(window) != count.parent || !IsWindowVisible(window))
        return TRUE;
    wchar_t className[128];
    if (!GetClassNameW(window, className, 128) || lstrcmpiW(className, count.className) != 0)
        return TRUE;
    if (!ShowsOnScreen(window))
        return TRUE;
    ++count.visible;
    if (GetPropW(window, kDrawnProperty))
        ++count.drawn;
    return TRUE;
}

} // namespace

void TimingWatchLibrary(HMODULE library) {
    if (!Host().options.timing || !library)
        return;
    Watch(library, "CreateFileA", &TimedCreateFileA, g_createFileA);
    Watch(library, "GetFileAttributesA", &TimedGetFileAttributesA, g_getFileAttributesA);
    // The scan goes through the runtime library's search; which of its names depends on the build.
    if (!Watch(library, "_findfirst64", &TimedFindFirst, g_findFirst))
        Watch(library, "_findfirst64i32", &TimedFindFirst, g_findFirst);
    if (!Watch(library, "_findnext64", &TimedFindNext, g_findNext))
        Watch(library, "_findnext64i32", &TimedFindNext, g_findNext);
    Watch(library, "_findclose", &TimedFindClose, g_findClose);
    // The folder scan itself: the system's wide search.
    Watch(library, "FindFirstFileExW", &TimedFindFirstFileExW, g_findFirstExW);
    Watch(library, "FindNextFileW", &TimedFindNextFileW, g_findNextW);
    Watch(library, "FindClose", &TimedFindCloseW, g_findCloseW);
    Watch(library, "SetDIBitsToDevice", &TimedSetDIBitsToDevice, g_setDIBitsToDevice);
}

void TimingCallBegins() {
    if (!Host().options.timing)
        return;
    QueryPerformanceFrequency(&g_frequency);
    QueryPerformanceCounter(&g_start);
    g_overhead = 0;
    g_afterKey = false;
    if (!g_hook)
        g_hook = SetWindowsHookExW(WH_GETMESSAGE, &GetMessageHook, nullptr, GetCurrentThreadId());
    if (!g_cbtHook)
        g_cbtHook = SetWindowsHookExW(WH_CBT, &CreateWindowHook, nullptr, GetCurrentThreadId());
    // A hook on sent messages makes every message the library sends under Wine slower (the call goes
    // through the wine server), so it is only there when asked for, and never for the benchmarks' figures.
    if (!g_sentHook && Host().options.timingSent)
        g_sentHook = SetWindowsHookExW(WH_CALLWNDPROC, &SentMessageHook, nullptr, GetCurrentThreadId());
    g_inCall = true;
    g_uiThread = GetCurrentThreadId();
    Line(0.0, L"call");
    g_pinger = new Pinger;
    g_pinger->uiThread = g_uiThread;
    HANDLE thread = CreateThread(nullptr, 0, &PingExplorer, g_pinger, 0, nullptr);
    if (thread)
        CloseHandle(thread);
    else {
        delete g_pinger;
        g_pinger = nullptr;
    }
}

void TimingInputSent(const std::wstring& what) {
    // The clock is read from the script's thread; the overhead it subtracts may be a line behind.
    if (!Host().options.timing || !g_inCall)
        return;
    Line(Elapsed(), L"input " + what);
}

void TimingCallEnded() {
    if (!Host().options.timing)
        return;
    g_inCall = false;
    const double end = Elapsed();
    if (g_pinger) {
        // Read before the stop: a send still waiting would count the time after the call.
        const LONG longest = g_pinger->longestMicro;
        InterlockedExchange(&g_pinger->stop, 1);
        g_pinger = nullptr;
        wchar_t number[32];
        std::swprintf(number, sizeof number / sizeof number[0], L"%.3f", longest / 1000.0);
        Line(end, L"longest-unanswered " + std::wstring(number));
    }
    Line(end, L"opened " + std::to_wstring(DrawingFilesOpened()));
    Line(end, L"call-end");
    if (g_hook)
        UnhookWindowsHookEx(g_hook);
    g_hook = nullptr;
    if (g_cbtHook)
        UnhookWindowsHookEx(g_cbtHook);
    g_cbtHook = nullptr;
    if (g_sentHook)
        UnhookWindowsHookEx(g_sentHook);
    g_sentHook = nullptr;
}

namespace {
void PreviewShown(HWND window, const std::wstring* fileName) {
    Overhead measuring; // the counting below is the benchmark's cost, not the library's
    const double ms = Elapsed();
    const std::wstring name = fileName ? *fileName : LabelUnder(window);
    SetPropW(window, kDrawnProperty, reinterpret_cast<HANDLE>(1));
    VisibleCount count;
    count.parent = GetParent(window);
    GetClassNameW(window, count.className, 128);
    if (count.parent)
        EnumChildWindows(count.parent, &CountSibling, reinterpret_cast<LPARAM>(&count));
    Line(ms,
         L"preview " + std::to_wstring(count.drawn) + L"/" + std::to_wstring(count.visible) + L" " + name);
}
} // namespace

void TimingPreviewDrawn(HWND window, const wchar_t* fileName) {
    if (!Host().options.timing)
        return;
    const std::wstring name = fileName ? std::wstring(fileName) : std::wstring();
    PreviewShown(window, &name);
}

} // namespace devhost
