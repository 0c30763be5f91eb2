#include "devhost/Timing.h"

#include "devhost/HostObjects.h"
#include "devhost/Output.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
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
bool g_inCall = false;
long g_scanEntries = 0;

// Time devhost spends measuring (counting windows, writing lines) inside the call: left out of every
// time printed, so that the lines show the library's time and the host's drawing, not the benchmark's.
LONGLONG g_overhead = 0;

LONGLONG Now() {
    LARGE_INTEGER now;
    QueryPerformanceCounter(&now);
    return now.QuadPart;
}

double Elapsed() {
    return static_cast<double>(Now() - g_start.QuadPart - g_overhead) * 1000.0 /
           static_cast<double>(g_frequency.QuadPart);
}

// Adds the time from its construction to its destruction to the overhead.
class Overhead {
public:
    Overhead() : m_begin(Now()) {}
    Overhead(const Overhead&) = delete;
    Overhead& operator=(const Overhead&) = delete;
    ~Overhead() { g_overhead += Now() - m_begin; }

private:
    LONGLONG m_begin;
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

// Replaces the address of the imported function `name` in module's import table by `replacement` and
// returns the address it held (nullptr when the module does not import it).
void* PatchImport(HMODULE module, const char* name, void* replacement) {
    auto* base = reinterpret_cast<unsigned char*>(module);
    const auto* dos = reinterpret_cast<const IMAGE_DOS_HEADER*>(base);
    const auto* nt = reinterpret_cast<const IMAGE_NT_HEADERS*>(base + dos->e_lfanew);
    const IMAGE_DATA_DIRECTORY& directory = nt->OptionalHeader.DataDirectory[IMAGE_DIRECTORY_ENTRY_IMPORT];
    if (!directory.VirtualAddress)
        return nullptr;
    for (auto* import = reinterpret_cast<const IMAGE_IMPORT_DESCRIPTOR*>(base + directory.VirtualAddress);
         import->Name; ++import) {
        const auto* names = reinterpret_cast<const IMAGE_THUNK_DATA*>(
            base + (import->OriginalFirstThunk ? import->OriginalFirstThunk : import->FirstThunk));
        auto* addresses = reinterpret_cast<IMAGE_THUNK_DATA*>(base + import->FirstThunk);
        for (; names->u1.AddressOfData; ++names, ++addresses) {
            if (IMAGE_SNAP_BY_ORDINAL(names->u1.Ordinal))
                continue;
            const auto* byName =
                reinterpret_cast<const IMAGE_IMPORT_BY_NAME*>(base + names->u1.AddressOfData);
            if (std::strcmp(reinterpret_cast<const char*>(byName->Name), name) != 0)
                continue;
            DWORD protection = 0;
            if (!VirtualProtect(&addresses->u1.Function, sizeof addresses->u1.Function, PAGE_READWRITE,
                                &protection))
                return nullptr;
            void* original = reinterpret_cast<void*>(addresses->u1.Function);
            addresses->u1.Function = reinterpret_cast<ULONG_PTR>(replacement);
            VirtualProtect(&addresses->u1.Function, sizeof addresses->u1.Function, protection, &protection);
            return original;
        }
    }
    return nullptr;
}

template <class Fn> bool Watch(HMODULE module, const char* name, Fn replacement, Fn& original) {
    void* was = PatchImport(module, name, reinterpret_cast<void*>(replacement));
    if (!was)
        return false;
    original = reinterpret_cast<Fn>(was);
    return true;
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
    Line(0.0, L"call");
}

void TimingCallEnded() {
    if (!Host().options.timing)
        return;
    g_inCall = false;
    Line(Elapsed(), L"call-end");
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

void TimingPreviewDrawn(HWND window, const wchar_t* fileName) {
    if (!Host().options.timing)
        return;
    Overhead measuring; // the counting below is the benchmark's cost, not the library's
    const double ms = Elapsed();
    SetPropW(window, kDrawnProperty, reinterpret_cast<HANDLE>(1));
    VisibleCount count;
    count.parent = GetParent(window);
    GetClassNameW(window, count.className, 128);
    if (count.parent)
        EnumChildWindows(count.parent, &CountSibling, reinterpret_cast<LPARAM>(&count));
    Line(ms, L"preview " + std::to_wstring(count.drawn) + L"/" + std::to_wstring(count.visible) + L" " +
                 (fileName ? std::wstring(fileName) : std::wstring()));
}

} // namespace devhost
