#include "devhost/Timing.h"

#include "devhost/HostObjects.h"
#include "devhost/Output.h"

#include <cstdio>
#include <string>

namespace devhost {
namespace {

// A window that has had a preview drawn carries this property; it goes with the window.
const wchar_t kDrawnProperty[] = L"DevhostPreviewDrawn";

LARGE_INTEGER g_start{};
LARGE_INTEGER g_frequency{};
HHOOK g_hook = nullptr;
bool g_afterKey = false;

double Elapsed() {
    LARGE_INTEGER now;
    QueryPerformanceCounter(&now);
    return static_cast<double>(now.QuadPart - g_start.QuadPart) * 1000.0 /
           static_cast<double>(g_frequency.QuadPart);
}

void Line(double ms, const std::wstring& what) {
    wchar_t number[32];
    std::swprintf(number, sizeof number / sizeof number[0], L"%.3f", ms);
    WriteLine(L"[timing] " + std::wstring(number) + L" " + what);
}

// Sees every message the user-interface thread takes from its queue, whoever's loop takes it.
LRESULT CALLBACK GetMessageHook(int code, WPARAM removal, LPARAM data) {
    if (code == HC_ACTION && removal == PM_REMOVE) {
        try {
            const MSG* message = reinterpret_cast<const MSG*>(data);
            if (g_afterKey) {
                g_afterKey = false;
                Line(Elapsed(), L"key-handled");
            }
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

struct VisibleCount {
    HWND parent = nullptr;
    wchar_t className[128] = {};
    RECT client{};
    int visible = 0;
    int drawn = 0;
};

BOOL CALLBACK CountSibling(HWND window, LPARAM data) {
    VisibleCount& count = *reinterpret_cast<VisibleCount*>(data);
    if (GetParent(window) != count.parent || !IsWindowVisible(window))
        return TRUE;
    wchar_t className[128];
    if (!GetClassNameW(window, className, 128) || lstrcmpiW(className, count.className) != 0)
        return TRUE;
    RECT rect;
    GetWindowRect(window, &rect);
    MapWindowPoints(nullptr, count.parent, reinterpret_cast<POINT*>(&rect), 2);
    RECT shown;
    if (!IntersectRect(&shown, &rect, &count.client))
        return TRUE;
    ++count.visible;
    if (GetPropW(window, kDrawnProperty))
        ++count.drawn;
    return TRUE;
}

} // namespace

void TimingCallBegins() {
    if (!Host().options.timing)
        return;
    QueryPerformanceFrequency(&g_frequency);
    QueryPerformanceCounter(&g_start);
    g_afterKey = false;
    if (!g_hook)
        g_hook = SetWindowsHookExW(WH_GETMESSAGE, &GetMessageHook, nullptr, GetCurrentThreadId());
    Line(0.0, L"call");
}

void TimingCallEnded() {
    if (!Host().options.timing)
        return;
    Line(Elapsed(), L"call-end");
    if (g_hook)
        UnhookWindowsHookEx(g_hook);
    g_hook = nullptr;
}

void TimingPreviewDrawn(HWND window, const wchar_t* fileName) {
    if (!Host().options.timing)
        return;
    const double ms =
        Elapsed(); // before the counting below, which is the benchmark's cost, not the library's
    SetPropW(window, kDrawnProperty, reinterpret_cast<HANDLE>(1));
    VisibleCount count;
    count.parent = GetParent(window);
    GetClassNameW(window, count.className, 128);
    if (count.parent) {
        GetClientRect(count.parent, &count.client);
        EnumChildWindows(count.parent, &CountSibling, reinterpret_cast<LPARAM>(&count));
    }
    Line(ms, L"preview " + std::to_wstring(count.drawn) + L"/" + std::to_wstring(count.visible) + L" " +
                 (fileName ? std::wstring(fileName) : std::wstring()));
}

} // namespace devhost
