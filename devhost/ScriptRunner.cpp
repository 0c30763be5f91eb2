#include "devhost/ScriptRunner.h"

#include "devhost/Bitmap.h"
#include "devhost/ColorDialog.h"
#include "devhost/HostObjects.h"
#include "devhost/HostWindows.h"
#include "devhost/Output.h"
#include "devhost/Text.h"
#include "devhost/Timing.h"
#include "thumbs/AppMessages.h"

#include <commctrl.h>
#include <shellapi.h>
#include <shlobj.h>
#include <wincodec.h>

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string>

namespace devhost {
namespace {

constexpr int kPollMs = 50;
constexpr DWORD kSettleMs = 150; // after input, time for the user-interface thread to act on it

struct ScriptError {
    std::wstring message;
};

std::wstring ClassOf(HWND hwnd) {
    wchar_t name[256] = {};
    GetClassNameW(hwnd, name, 256);
    return name;
}

// The text through WM_GETTEXT, which controls answer themselves; never waits long on a busy window.
std::wstring TextOf(HWND hwnd) {
    DWORD_PTR length = 0;
    if (!SendMessageTimeoutW(hwnd, WM_GETTEXTLENGTH, 0, 0, SMTO_ABORTIFHUNG, 2000, &length))
        return std::wstring();
    std::wstring text(static_cast<std::size_t>(length) + 1, L'\0');
    DWORD_PTR copied = 0;
    if (!SendMessageTimeoutW(hwnd, WM_GETTEXT, text.size(), reinterpret_cast<LPARAM>(text.data()),
                             SMTO_ABORTIFHUNG, 2000, &copied))
        return std::wstring();
    text.resize(static_cast<std::size_t>(copied) < text.size() ? static_cast<std::size_t>(copied) : length);
    return text;
}

bool Matches(HWND hwnd, const WindowStep& step) {
    if (!step.anyVisibility && !IsWindowVisible(hwnd))
        return false;
    if (!step.className.empty() &&
        CompareStringOrdinal(ClassOf(hwnd).c_str(), -1, step.className.c_str(), -1, TRUE) != CSTR_EQUAL)
        return false;
    if (step.hasId && GetDlgCtrlID(hwnd) != step.id)
        return false;
    if (step.hasText || !step.contains.empty()) {
        const std::wstring text = TextOf(hwnd);
        if (step.hasText && text != step.text)
            return false;
        if (!step.contains.empty() && text.find(step.contains) == std::wstring::npos)
            return false;
    }
    return true;
}

BOOL CALLBACK CollectChild(HWND hwnd, LPARAM list) {
    reinterpret_cast<std::vector<HWND>*>(list)->push_back(hwnd);
    return TRUE;
}

BOOL CALLBACK CollectTopLevel(HWND hwnd, LPARAM list) {
    DWORD process = 0;
    GetWindowThreadProcessId(hwnd, &process);
    if (process == GetCurrentProcessId()) {
        auto* windows = reinterpret_cast<std::vector<HWND>*>(list);
        windows->push_back(hwnd);
        EnumChildWindows(hwnd, &CollectChild, list);
    }
    return TRUE;
}

// Every window of the process: each top-level window followed by its descendants.
std::vector<HWND> ProcessWindows() {
    std::vector<HWND> windows;
    EnumWindows(&CollectTopLevel, reinterpret_cast<LPARAM>(&windows));
    return windows;
}

std::vector<HWND> Select(const std::vector<HWND>& candidates, const WindowStep& step) {
    std::vector<HWND> matches;
    for (HWND hwnd : candidates)
        if (Matches(hwnd, step))
            matches.push_back(hwnd);
    if (step.nth >= 0) {
        if (static_cast<std::size_t>(step.nth) >= matches.size())
            return {};
        return {matches[static_cast<std::size_t>(step.nth)]};
    }
    return matches;
}

std::vector<HWND> FindWindows(const std::vector<WindowStep>& path) {
    std::vector<HWND> found;
    for (std::size_t i = 0; i < path.size(); ++i) {
        std::vector<HWND> candidates;
        if (i == 0) {
            candidates = ProcessWindows();
        } else {
            for (HWND parent : found) {
                std::vector<HWND> children;
                EnumChildWindows(parent, &CollectChild, reinterpret_cast<LPARAM>(&children));
                for (HWND child : children)
                    if (std::find(candidates.begin(), candidates.end(), child) == candidates.end())
                        candidates.push_back(child);
            }
        }
        found = Select(candidates, path[i]);
        if (found.empty())
            break;
    }
    return found;
}

HWND WaitForWindow(const ScriptCommand& command) {
    const ULONGLONG deadline = GetTickCount64() + static_cast<ULONGLONG>(command.timeoutMs);
    for (;;) {
        const std::vector<HWND> found = FindWindows(command.window);
        if (!found.empty())
            return found.front();
        if (GetTickCount64() >= deadline)
            throw ScriptError{L"no window " + DescribeWindow(command.window) + L" within " +
                              std::to_wstring(command.timeoutMs) + L" ms"};
        Sleep(kPollMs);
    }
}

void WaitGone(const ScriptCommand& command) {
    const ULONGLONG deadline = GetTickCount64() + static_cast<ULONGLONG>(command.timeoutMs);
    while (!FindWindows(command.window).empty()) {
        if (GetTickCount64() >= deadline)
            throw ScriptError{L"window " + DescribeWindow(command.window) + L" still there after " +
                              std::to_wstring(command.timeoutMs) + L" ms"};
        Sleep(kPollMs);
    }
}

void Send(std::vector<INPUT>& inputs) {
    if (inputs.empty())
        return;
    const UINT sent = SendInput(static_cast<UINT>(inputs.size()), inputs.data(), sizeof(INPUT));
    if (sent != inputs.size())
        throw ScriptError{L"SendInput refused the input (error " + std::to_wstring(GetLastError()) + L")"};
    inputs.clear();
}

bool IsExtendedKey(WORD key) {
    switch (key) {
    case VK_INSERT:
    case VK_DELETE:
    case VK_HOME:
    case VK_END:
    case VK_PRIOR:
    case VK_NEXT:
    case VK_LEFT:
    case VK_RIGHT:
    case VK_UP:
    case VK_DOWN:
    case VK_APPS:
        return true;
    default:
        return false;
    }
}

void AddKey(std::vector<INPUT>& inputs, WORD key, bool up) {
    INPUT input{};
    input.type = INPUT_KEYBOARD;
    input.ki.wVk = key;
    input.ki.wScan = static_cast<WORD>(MapVirtualKeyW(key, MAPVK_VK_TO_VSC));
    input.ki.dwFlags = (up ? KEYEVENTF_KEYUP : 0) | (IsExtendedKey(key) ? KEYEVENTF_EXTENDEDKEY : 0);
    inputs.push_back(input);
}

void AddModifiers(std::vector<INPUT>& inputs, unsigned modifiers, bool up) {
    const WORD keys[] = {VK_CONTROL, VK_SHIFT, VK_MENU};
    const unsigned flags[] = {kCtrl, kShift, kAlt};
    for (int i = 0; i < 3; ++i) {
        const int k = up ? 2 - i : i;
        if (modifiers & flags[k])
            AddKey(inputs, keys[k], up);
    }
}

void AddMouse(std::vector<INPUT>& inputs, DWORD flags) {
    INPUT input{};
    input.type = INPUT_MOUSE;
    input.mi.dwFlags = flags;
    inputs.push_back(input);
}

// The screen point of the command: at=X,Y in the window's client area, or the client area's centre.
POINT TargetPoint(HWND hwnd, const ScriptCommand& command) {
    POINT point{command.x, command.y};
    if (command.windowPoint) { // the caption and the frame too, e.g. a close box: window-at=-12,10
        RECT window{};
        GetWindowRect(hwnd, &window);
        return {command.x < 0 ? window.right + command.x : window.left + command.x,
                command.y < 0 ? window.bottom + command.y : window.top + command.y};
    }
    if (!command.hasPoint) {
        RECT client{};
        GetClientRect(hwnd, &client);
        point = {client.right / 2, client.bottom / 2};
    }
    ClientToScreen(hwnd, &point);
    return point;
}

void MovePointer(POINT point) {
    const int width = GetSystemMetrics(SM_CXSCREEN);
    const int height = GetSystemMetrics(SM_CYSCREEN);
    INPUT input{};
    input.type = INPUT_MOUSE;
    input.mi.dx = MulDiv(point.x, 65535, width > 1 ? width - 1 : 1);
    input.mi.dy = MulDiv(point.y, 65535, height > 1 ? height - 1 : 1);
    input.mi.dwFlags = MOUSEEVENTF_MOVE | MOUSEEVENTF_ABSOLUTE;
    std::vector<INPUT> inputs{input};
    Send(inputs);
    POINT now{};
    // The normalised coordinates can land a pixel off; put the pointer exactly where it was meant to go.
    if (GetCursorPos(&now) && (now.x != point.x || now.y != point.y))
        SetCursorPos(point.x, point.y);
}

void Click(HWND hwnd, const ScriptCommand& command) {
    MovePointer(TargetPoint(hwnd, command));
    Sleep(30);
    std::vector<INPUT> inputs;
    AddModifiers(inputs, command.modifiers, false);
    const bool right = command.kind == ScriptCommand::Kind::RightClick;
    const int clicks = command.kind == ScriptCommand::Kind::DoubleClick ? 2 : 1;
    for (int i = 0; i < clicks; ++i) {
        AddMouse(inputs, right ? MOUSEEVENTF_RIGHTDOWN : MOUSEEVENTF_LEFTDOWN);
        AddMouse(inputs, right ? MOUSEEVENTF_RIGHTUP : MOUSEEVENTF_LEFTUP);
    }
    AddModifiers(inputs, command.modifiers, true);
    Send(inputs);
}

// The screen point where a drag lets go: to=X,Y as at= or window-at= reads it, a percentage being that
// share of the window's (or client area's) width or height.
POINT DropPoint(HWND hwnd, const ScriptCommand& command) {
    RECT area{};
    if (command.windowPoint)
        GetWindowRect(hwnd, &area);
    else
        GetClientRect(hwnd, &area);
    auto coordinate = [](int value, bool percent, LONG low, LONG high, bool fromEnd) {
        if (percent)
            return static_cast<LONG>(low + MulDiv(high - low, value, 100));
        return fromEnd && value < 0 ? high + value : low + value;
    };
    POINT point{coordinate(command.toX, command.toXPercent, area.left, area.right, command.windowPoint),
                coordinate(command.toY, command.toYPercent, area.top, area.bottom, command.windowPoint)};
    if (!command.windowPoint)
        ClientToScreen(hwnd, &point);
    return point;
}

// Presses the left button at the command's point, moves the pointer to the drop point in steps (as a hand
// does: the window sees each move while the button is down) and lets go there.
void Drag(HWND hwnd, const ScriptCommand& command) {
    const POINT from = TargetPoint(hwnd, command);
    const POINT to = DropPoint(hwnd, command);
    MovePointer(from);
    Sleep(30);
    std::vector<INPUT> press;
    AddMouse(press, MOUSEEVENTF_LEFTDOWN);
    Send(press);
    Sleep(60);
    for (int i = 1; i <= command.steps; ++i) {
        MovePointer({from.x + MulDiv(to.x - from.x, i, command.steps),
                     from.y + MulDiv(to.y - from.y, i, command.steps)});
        Sleep(40);
    }
    Sleep(100);
    std::vector<INPUT> release;
    AddMouse(release, MOUSEEVENTF_LEFTUP);
    Send(release);
}

// The vertical scroll bar of a window: its SCROLLINFO and where its thumb is, in the window's coordinates
// (from its top, as window-at= counts).
std::wstring DescribeScrollBar(HWND hwnd) {
    SCROLLINFO info{};
    info.cbSize = sizeof info;
    info.fMask = SIF_ALL;
    if (!GetScrollInfo(hwnd, SB_VERT, &info))
        return L"scrollbar none";
    SCROLLBARINFO bar{};
    bar.cbSize = sizeof bar;
    RECT window{};
    GetWindowRect(hwnd, &window);
    int thumbTop = -1, thumbBottom = -1, troughTop = -1, troughBottom = -1;
    if (GetScrollBarInfo(hwnd, static_cast<LONG>(OBJID_VSCROLL), &bar)) {
        thumbTop = bar.rcScrollBar.top - window.top + bar.xyThumbTop;
        thumbBottom = bar.rcScrollBar.top - window.top + bar.xyThumbBottom;
        troughTop = bar.rcScrollBar.top - window.top + bar.dxyLineButton;
        troughBottom = bar.rcScrollBar.bottom - window.top - bar.dxyLineButton;
    }
    return L"scrollbar pos=" + std::to_wstring(info.nPos) + L" min=" + std::to_wstring(info.nMin) + L" max=" +
           std::to_wstring(info.nMax) + L" page=" + std::to_wstring(info.nPage) + L" thumb=" +
           std::to_wstring(thumbTop) + L"," + std::to_wstring(thumbBottom) + L" trough=" +
           std::to_wstring(troughTop) + L"," + std::to_wstring(troughBottom);
}

void PressKeys(const ScriptCommand& command) {
    for (const KeyChord& chord : command.keys) {
        std::vector<INPUT> inputs;
        AddModifiers(inputs, chord.modifiers, false);
        AddKey(inputs, chord.virtualKey, false);
        AddKey(inputs, chord.virtualKey, true);
        AddModifiers(inputs, chord.modifiers, true);
        Send(inputs);
        TimingInputSent(L"key " + std::to_wstring(chord.virtualKey));
        Sleep(30);
    }
}

void TypeText(const std::wstring& text) {
    for (wchar_t c : text) {
        std::vector<INPUT> inputs;
        for (bool up : {false, true}) {
            INPUT input{};
            input.type = INPUT_KEYBOARD;
            input.ki.wScan = static_cast<WORD>(c);
            input.ki.dwFlags = KEYEVENTF_UNICODE | (up ? KEYEVENTF_KEYUP : 0);
            inputs.push_back(input);
        }
        Send(inputs);
        Sleep(10);
    }
}

// What the screen shows of the window (its on-screen rectangle, with whatever overlaps it).
Image CaptureWindow(HWND hwnd) {
    RECT rect{};
    GetWindowRect(hwnd, &rect);
    Image image;
    image.width = rect.right - rect.left;
    image.height = rect.bottom - rect.top;
    if (image.width <= 0 || image.height <= 0)
        throw ScriptError{L"the window has no size to capture"};
    HDC screen = GetDC(nullptr);
    HDC memory = CreateCompatibleDC(screen);
    BITMAPINFO info{};
    info.bmiHeader.biSize = sizeof info.bmiHeader;
    info.bmiHeader.biWidth = image.width;
    info.bmiHeader.biHeight = -image.height; // top-down
    info.bmiHeader.biPlanes = 1;
    info.bmiHeader.biBitCount = 24;
    info.bmiHeader.biCompression = BI_RGB;
    void* bits = nullptr;
    HBITMAP bitmap = CreateDIBSection(screen, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    bool copied = false;
    if (bitmap && memory) {
        HGDIOBJ old = SelectObject(memory, bitmap);
        copied = BitBlt(memory, 0, 0, image.width, image.height, screen, rect.left, rect.top,
                        SRCCOPY | CAPTUREBLT);
        GdiFlush();
        if (copied) {
            const std::size_t stride =
                (static_cast<std::size_t>(image.width) * 3 + 3) & ~static_cast<std::size_t>(3);
            const std::size_t row = static_cast<std::size_t>(image.width) * 3;
            image.bgr.resize(row * static_cast<std::size_t>(image.height));
            for (int y = 0; y < image.height; ++y)
                std::memcpy(image.bgr.data() + static_cast<std::size_t>(y) * row,
                            static_cast<const std::uint8_t*>(bits) + static_cast<std::size_t>(y) * stride,
                            row);
        }
        SelectObject(memory, old);
    }
    if (bitmap)
        DeleteObject(bitmap);
    if (memory)
        DeleteDC(memory);
    ReleaseDC(nullptr, screen);
    if (!copied)
        throw ScriptError{L"could not capture the screen"};
    return image;
}

template <class T> struct ComPtr {
    T* p = nullptr;
    ComPtr() = default;
    ComPtr(const ComPtr&) = delete;
    ComPtr& operator=(const ComPtr&) = delete;
    ~ComPtr() {
        if (p)
            p->Release();
    }
};

bool EndsWithIgnoreCase(const std::wstring& text, const wchar_t* suffix) {
    const std::size_t n = wcslen(suffix);
    return text.size() >= n &&
           CompareStringOrdinal(text.c_str() + text.size() - n, -1, suffix, -1, TRUE) == CSTR_EQUAL;
}

void SavePng(const Image& image, const std::wstring& file) {
    const HRESULT init = CoInitializeEx(nullptr, COINIT_MULTITHREADED);
    HRESULT hr = S_OK;
    {
        ComPtr<IWICImagingFactory> factory;
        ComPtr<IWICStream> stream;
        ComPtr<IWICBitmapEncoder> encoder;
        ComPtr<IWICBitmapFrameEncode> frame;
        const UINT stride = static_cast<UINT>(image.width) * 3;
        WICPixelFormatGUID format = GUID_WICPixelFormat24bppBGR;
        hr = CoCreateInstance(CLSID_WICImagingFactory, nullptr, CLSCTX_INPROC_SERVER, IID_IWICImagingFactory,
                              reinterpret_cast<void**>(&factory.p));
        if (SUCCEEDED(hr))
            hr = factory.p->CreateStream(&stream.p);
        if (SUCCEEDED(hr))
            hr = stream.p->InitializeFromFilename(file.c_str(), GENERIC_WRITE);
        if (SUCCEEDED(hr))
            hr = factory.p->CreateEncoder(GUID_ContainerFormatPng, nullptr, &encoder.p);
        if (SUCCEEDED(hr))
            hr = encoder.p->Initialize(stream.p, WICBitmapEncoderNoCache);
        if (SUCCEEDED(hr))
            hr = encoder.p->CreateNewFrame(&frame.p, nullptr);
        if (SUCCEEDED(hr))
            hr = frame.p->Initialize(nullptr);
        if (SUCCEEDED(hr))
            hr = frame.p->SetSize(static_cast<UINT>(image.width), static_cast<UINT>(image.height));
        if (SUCCEEDED(hr))
            hr = frame.p->SetPixelFormat(&format);
        if (SUCCEEDED(hr) && format != GUID_WICPixelFormat24bppBGR)
            hr = E_FAIL;
        if (SUCCEEDED(hr))
            hr = frame.p->WritePixels(static_cast<UINT>(image.height), stride,
                                      static_cast<UINT>(image.bgr.size()),
                                      const_cast<BYTE*>(image.bgr.data()));
        if (SUCCEEDED(hr))
            hr = frame.p->Commit();
        if (SUCCEEDED(hr))
            hr = encoder.p->Commit();
    }
    if (SUCCEEDED(init))
        CoUninitialize();
    if (FAILED(hr)) {
        wchar_t code[16];
        swprintf(code, 16, L"%08lX", static_cast<unsigned long>(hr));
        throw ScriptError{L"could not write the PNG file " + file + L" (HRESULT " + code + L")"};
    }
}

void SaveBmp(const Image& image, const std::wstring& file) {
    const std::vector<std::uint8_t> bytes = EncodeBmp24(image);
    HANDLE handle =
        CreateFileW(file.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    DWORD written = 0;
    const bool ok = handle != INVALID_HANDLE_VALUE &&
                    WriteFile(handle, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr) &&
                    written == bytes.size();
    if (handle != INVALID_HANDLE_VALUE)
        CloseHandle(handle);
    if (!ok)
        throw ScriptError{L"could not write the file " + file};
}

std::wstring YesNo(bool value) {
    return value ? L"yes" : L"no";
}

void Fact(const std::wstring& text) {
    WriteLine(L"[script] " + text);
}

// ---- tree controls, read through their window (same process: item structures may be sent) ----

LRESULT TreeSend(HWND tree, UINT message, WPARAM wParam, LPARAM lParam) {
    DWORD_PTR result = 0;
    if (!SendMessageTimeoutW(tree, message, wParam, lParam, SMTO_ABORTIFHUNG, 5000, &result))
        throw ScriptError{L"the tree window does not answer"};
    return static_cast<LRESULT>(result);
}

HTREEITEM TreeNext(HWND tree, HTREEITEM item, UINT code) {
    return reinterpret_cast<HTREEITEM>(TreeSend(tree, TVM_GETNEXTITEM, code, reinterpret_cast<LPARAM>(item)));
}

std::wstring TreeLabel(HWND tree, HTREEITEM item) {
    wchar_t text[520] = {};
    TVITEMW query{};
    query.mask = TVIF_TEXT | TVIF_HANDLE;
    query.hItem = item;
    query.pszText = text;
    query.cchTextMax = 520;
    if (!TreeSend(tree, TVM_GETITEMW, 0, reinterpret_cast<LPARAM>(&query)))
        return std::wstring();
    // A control may answer with its own buffer instead of ours.
    return query.pszText ? std::wstring(query.pszText) : std::wstring();
}

bool TreeExpanded(HWND tree, HTREEITEM item) {
    return (TreeSend(tree, TVM_GETITEMSTATE, reinterpret_cast<WPARAM>(item), TVIS_EXPANDED) &
            TVIS_EXPANDED) != 0;
}

// The item a label path names: the first label among the top-level items, each next one among the
// children of the item before; labels compare without regard to case, as the folder tree's own walk.
HTREEITEM FindTreeItem(HWND tree, const std::wstring& path) {
    HTREEITEM item = nullptr;
    std::size_t start = 0;
    while (start <= path.size()) {
        const std::size_t slash = path.find(L'\\', start);
        const std::wstring label = path.substr(start, slash == std::wstring::npos ? slash : slash - start);
        HTREEITEM candidate = item ? TreeNext(tree, item, TVGN_CHILD) : TreeNext(tree, nullptr, TVGN_ROOT);
        while (candidate && CompareStringOrdinal(TreeLabel(tree, candidate).c_str(), -1, label.c_str(), -1,
                                                 TRUE) != CSTR_EQUAL)
            candidate = TreeNext(tree, candidate, TVGN_NEXT);
        if (!candidate)
            throw ScriptError{L"no tree item " +
                              path.substr(0, slash == std::wstring::npos ? path.size() : slash)};
        item = candidate;
        if (slash == std::wstring::npos)
            break;
        start = slash + 1;
    }
    return item;
}

// The item's label rectangle in client coordinates, scrolled into view when its parents are open
// (as a person would scroll to it); an item hidden in a closed parent is an error.
RECT TreeLabelRect(HWND tree, HTREEITEM item, const std::wstring& path) {
    for (HTREEITEM parent = TreeNext(tree, item, TVGN_PARENT); parent;
         parent = TreeNext(tree, parent, TVGN_PARENT))
        if (!TreeExpanded(tree, parent))
            throw ScriptError{L"tree item " + path + L" is inside a closed item"};
    TreeSend(tree, TVM_ENSUREVISIBLE, 0, reinterpret_cast<LPARAM>(item));
    RECT rect{};
    std::memcpy(&rect, &item, sizeof item); // TVM_GETITEMRECT takes the item in the rectangle
    if (!TreeSend(tree, TVM_GETITEMRECT, TRUE, reinterpret_cast<LPARAM>(&rect)))
        throw ScriptError{L"tree item " + path + L" is not shown"};
    return rect;
}

// The client point of the item's expand button: the row's points left of the label, asked of the
// control one by one.
POINT TreeButtonPoint(HWND tree, HTREEITEM item, const RECT& label, const std::wstring& path) {
    const int y = (label.top + label.bottom) / 2;
    for (int x = label.left - 1; x >= 0; --x) {
        TVHITTESTINFO hit{};
        hit.pt = {x, y};
        TreeSend(tree, TVM_HITTEST, 0, reinterpret_cast<LPARAM>(&hit));
        if (hit.hItem == item && (hit.flags & TVHT_ONITEMBUTTON))
            return hit.pt;
    }
    throw ScriptError{L"tree item " + path + L" has no expand button"};
}

void ClickTreePoint(HWND tree, POINT client, bool right) {
    ClientToScreen(tree, &client);
    MovePointer(client);
    Sleep(30);
    std::vector<INPUT> inputs;
    AddMouse(inputs, right ? MOUSEEVENTF_RIGHTDOWN : MOUSEEVENTF_LEFTDOWN);
    AddMouse(inputs, right ? MOUSEEVENTF_RIGHTUP : MOUSEEVENTF_LEFTUP);
    Send(inputs);
}

template <class Condition> void WaitTree(const ScriptCommand& command, const wchar_t* what, Condition done) {
    const ULONGLONG deadline = GetTickCount64() + static_cast<ULONGLONG>(command.timeoutMs);
    while (!done()) {
        if (GetTickCount64() >= deadline)
            throw ScriptError{L"tree item " + command.treePath + L" is not " + what + L" after " +
                              std::to_wstring(command.timeoutMs) + L" ms"};
        Sleep(kPollMs);
    }
}

void DriveTree(HWND tree, const ScriptCommand& command) {
    using Kind = ScriptCommand::Kind;
    const HTREEITEM item = FindTreeItem(tree, command.treePath);
    const bool expand = command.kind == Kind::TreeExpand;
    if ((expand || command.kind == Kind::TreeCollapse) && TreeExpanded(tree, item) == expand)
        return; // already as asked: a click on the button would undo it
    const RECT label = TreeLabelRect(tree, item, command.treePath);
    const POINT centre{(label.left + label.right) / 2, (label.top + label.bottom) / 2};
    switch (command.kind) {
    case Kind::TreeSelect:
        ClickTreePoint(tree, centre, false);
        WaitTree(command, L"selected", [&] { return TreeNext(tree, nullptr, TVGN_CARET) == item; });
        break;
    case Kind::TreeExpand:
    case Kind::TreeCollapse:
        ClickTreePoint(tree, TreeButtonPoint(tree, item, label, command.treePath), false);
        WaitTree(command, expand ? L"expanded" : L"collapsed",
                 [&] { return TreeExpanded(tree, item) == expand; });
        break;
    default:
        ClickTreePoint(tree, centre, true);
        break;
    }
}

// Every item whose parents are open, from the top: "tree-item LEVEL LABEL [expanded] [selected]".
// The clipboard, as another program uses it: a file list put there with the system's own layout (ANSI
// or wide names), and the list read back through the system's DragQueryFileW.
class OpenedClipboard {
public:
    // A message-only window of the script thread owns the clipboard while it is open: after
    // EmptyClipboard, SetClipboardData needs an owner.
    OpenedClipboard()
        : m_owner(
              CreateWindowExW(0, L"STATIC", L"", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr)) {
        for (int attempt = 0; attempt < 50 && !m_open; ++attempt) {
            m_open = OpenClipboard(m_owner) != FALSE;
            if (!m_open)
                Sleep(20);
        }
        if (!m_open)
            throw ScriptError{L"the clipboard cannot be opened (error " + std::to_wstring(GetLastError()) +
                              L")"};
    }
    ~OpenedClipboard() {
        CloseClipboard();
        if (m_owner)
            DestroyWindow(m_owner);
    }
    OpenedClipboard(const OpenedClipboard&) = delete;
    OpenedClipboard& operator=(const OpenedClipboard&) = delete;

private:
    HWND m_owner;
    bool m_open = false;
};

void PutClipboardFiles(const ScriptCommand& command) {
    std::string names;
    for (const std::wstring& file : command.files) {
        if (command.wide) {
            names.append(reinterpret_cast<const char*>(file.c_str()), (file.size() + 1) * sizeof(wchar_t));
        } else {
            const int n = WideCharToMultiByte(CP_ACP, 0, file.c_str(), -1, nullptr, 0, nullptr, nullptr);
            std::string ansi(static_cast<std::size_t>(n > 0 ? n : 1), '\0');
            WideCharToMultiByte(CP_ACP, 0, file.c_str(), -1, ansi.data(), n, nullptr, nullptr);
            names += ansi; // with its NUL
        }
    }
    names.append(command.wide ? 2 : 1, '\0');
    HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE | GMEM_ZEROINIT, sizeof(DROPFILES) + names.size());
    if (!block)
        throw ScriptError{L"no memory for the clipboard's file list"};
    auto* drop = static_cast<DROPFILES*>(GlobalLock(block));
    drop->pFiles = sizeof(DROPFILES);
    drop->fWide = command.wide ? TRUE : FALSE;
    std::memcpy(reinterpret_cast<char*>(drop) + sizeof(DROPFILES), names.data(), names.size());
    GlobalUnlock(block);
    OpenedClipboard clipboard;
    EmptyClipboard();
    if (!SetClipboardData(CF_HDROP, block)) {
        GlobalFree(block);
        throw ScriptError{L"the clipboard refused the file list"};
    }
    Fact(L"clipboard-put " + std::to_wstring(command.files.size()) + (command.wide ? L" wide" : L" ansi"));
}

// Text as another program copies it: Unicode text, which the system offers every program in its own code
// page as well (an ANSI edit pastes the ANSI form), so a test can paste a Japanese name where typing one
// through an ANSI edit cannot (Wine turns each byte of a double-byte character into a character alone).
void PutClipboardText(const std::wstring& text) {
    HGLOBAL block = GlobalAlloc(GMEM_MOVEABLE | GMEM_ZEROINIT, (text.size() + 1) * sizeof(wchar_t));
    if (!block)
        throw ScriptError{L"no memory for the clipboard's text"};
    std::memcpy(GlobalLock(block), text.c_str(), (text.size() + 1) * sizeof(wchar_t));
    GlobalUnlock(block);
    OpenedClipboard clipboard;
    EmptyClipboard();
    if (!SetClipboardData(CF_UNICODETEXT, block)) {
        GlobalFree(block);
        throw ScriptError{L"the clipboard refused the text"};
    }
    Fact(L"clipboard-text " + EscapeControls(text));
}

void PrintClipboardFiles() {
    OpenedClipboard clipboard;
    HANDLE data = IsClipboardFormatAvailable(CF_HDROP) ? GetClipboardData(CF_HDROP) : nullptr;
    if (!data) {
        Fact(L"clipboard-files none");
        return;
    }
    bool wide = false;
    if (const auto* drop = static_cast<const DROPFILES*>(GlobalLock(data))) {
        wide = drop->fWide != FALSE;
        GlobalUnlock(data);
    }
    auto* hdrop = static_cast<HDROP>(data);
    const UINT count = DragQueryFileW(hdrop, 0xFFFFFFFF, nullptr, 0);
    Fact(L"clipboard-files " + std::to_wstring(count) + (wide ? L" wide" : L" ansi"));
    for (UINT i = 0; i < count; ++i) {
        const UINT length = DragQueryFileW(hdrop, i, nullptr, 0);
        std::wstring name(length + 1, L'\0');
        DragQueryFileW(hdrop, i, name.data(), length + 1);
        name.resize(length);
        Fact(L"clipboard-file " + EscapeControls(name));
    }
}

void PrintTreeItems(HWND tree) {
    const HTREEITEM selected = TreeNext(tree, nullptr, TVGN_CARET);
    const HTREEITEM dropTarget = TreeNext(tree, nullptr, TVGN_DROPHILITE);
    for (HTREEITEM item = TreeNext(tree, nullptr, TVGN_ROOT); item;
         item = TreeNext(tree, item, TVGN_NEXTVISIBLE)) {
        int level = 0;
        for (HTREEITEM parent = TreeNext(tree, item, TVGN_PARENT); parent;
             parent = TreeNext(tree, parent, TVGN_PARENT))
            ++level;
        std::wstring line =
            L"tree-item " + std::to_wstring(level) + L" " + EscapeControls(TreeLabel(tree, item));
        if (TreeExpanded(tree, item))
            line += L" expanded";
        if (item == selected)
            line += L" selected";
        if (item == dropTarget)
            line += L" highlighted";
        Fact(line);
    }
}

struct RunDialogSearch {
    HWND found = nullptr;
    bool foundEmpty = false;
};

BOOL CALLBACK VisitThreadWindow(HWND hwnd, LPARAM param) {
    auto* search = reinterpret_cast<RunDialogSearch*>(param);
    if (ClassOf(hwnd) != L"#32770" || !IsWindowEnabled(hwnd))
        return TRUE;
    RECT rect{};
    GetWindowRect(hwnd, &rect);
    const bool empty = rect.right - rect.left <= 0 || rect.bottom - rect.top <= 0;
    if (!search->found || (empty && !search->foundEmpty)) {
        search->found = hwnd;
        search->foundEmpty = empty;
    }
    return TRUE;
}

} // namespace

HWND FindRunDialog(DWORD threadId) {
    RunDialogSearch search;
    EnumThreadWindows(threadId, &VisitThreadWindow, reinterpret_cast<LPARAM>(&search));
    return search.found;
}

namespace {

struct NestedSearch {
    HWND runDialog = nullptr;
    std::vector<HWND> dialogs;
};

BOOL CALLBACK VisitNestedWindow(HWND hwnd, LPARAM param) {
    auto* search = reinterpret_cast<NestedSearch*>(param);
    if (hwnd != search->runDialog && IsWindowVisible(hwnd) && ClassOf(hwnd) == L"#32770")
        search->dialogs.push_back(hwnd);
    return TRUE;
}

} // namespace

int EndNestedLoops(DWORD threadId) {
    int ended = 0;
    GUITHREADINFO info{};
    info.cbSize = sizeof info;
    if (GetGUIThreadInfo(threadId, &info) && (info.flags & (GUI_INMENUMODE | GUI_POPUPMENUMODE))) {
        if (threadId == GetCurrentThreadId())
            EndMenu();
        else if (info.hwndMenuOwner)
            PostMessageW(info.hwndMenuOwner, WM_CANCELMODE, 0, 0);
        ++ended;
    }
    NestedSearch search;
    search.runDialog = FindRunDialog(threadId);
    EnumThreadWindows(threadId, &VisitNestedWindow, reinterpret_cast<LPARAM>(&search));
    for (HWND dialog : search.dialogs) {
        // A box that is itself disabled waits for one above it.
        if (!IsWindowEnabled(dialog))
            continue;
        int answer = IDOK;
        if (GetDlgItem(dialog, IDCANCEL))
            answer = IDCANCEL;
        else if (GetDlgItem(dialog, IDNO))
            answer = IDNO;
        PostMessageW(dialog, WM_COMMAND, MAKEWPARAM(answer, BN_CLICKED), 0);
        ++ended;
    }
    return ended;
}

ScriptRunner::ScriptRunner(std::vector<ScriptCommand> commands, DWORD uiThreadId)
    : m_commands(std::move(commands)), m_uiThreadId(uiThreadId) {}

ScriptRunner::~ScriptRunner() {
    if (m_thread) {
        WaitForSingleObject(m_thread, INFINITE);
        CloseHandle(m_thread);
    }
}

bool ScriptRunner::Start() {
    if (m_thread)
        return true;
    m_thread = CreateThread(nullptr, 0, &ScriptRunner::ThreadProc, this, 0, nullptr);
    return m_thread != nullptr;
}

DWORD WINAPI ScriptRunner::ThreadProc(void* self) {
    auto* runner = static_cast<ScriptRunner*>(self);
    try {
        runner->Run();
    } catch (...) {
        runner->m_failed = true;
        WriteLine(L"[script] error: the script stopped on an unexpected failure");
    }
    return 0;
}

void ScriptRunner::Run() {
    for (const ScriptCommand& command : m_commands) {
        try {
            Execute(command);
        } catch (const ScriptError& error) {
            m_failed = true;
            WriteLine(L"[script] error: line " + std::to_wstring(command.line) + L": " +
                      EscapeControls(error.message));
            // Do not leave the LISP call waiting for input that will not come.
            // A menu or a box left open by the failed step would take the message and hold the call: end
            // them first (the colour dialog too), then post, until the call has returned.
            for (int round = 0; round < 200; ++round) {
                CancelColorDialog();
                if (EndNestedLoops(m_uiThreadId) == 0)
                    if (HWND dialog = FindRunDialog(m_uiThreadId))
                        PostMessageW(dialog, WM_ORVEX_RESULT, kAppCancel, 0);
                Sleep(kPollMs * 4);
                if (CallsPending() == 0)
                    break;
            }
            return;
        }
    }
}

bool ScriptRunner::Execute(const ScriptCommand& command) {
    using Kind = ScriptCommand::Kind;
    switch (command.kind) {
    case Kind::Wait:
        WaitForWindow(command);
        break;
    case Kind::Gone:
        WaitGone(command);
        break;
    case Kind::Sleep:
        Sleep(static_cast<DWORD>(command.ms));
        break;
    case Kind::Move:
        MovePointer(TargetPoint(WaitForWindow(command), command));
        Sleep(kSettleMs);
        break;
    case Kind::Click:
    case Kind::DoubleClick:
    case Kind::RightClick:
        Click(WaitForWindow(command), command);
        Sleep(kSettleMs);
        break;
    case Kind::Key:
        PressKeys(command);
        Sleep(kSettleMs);
        break;
    case Kind::Type:
        TypeText(command.text);
        Sleep(kSettleMs);
        break;
    case Kind::Screenshot: {
        const Image image = CaptureWindow(WaitForWindow(command));
        if (EndsWithIgnoreCase(command.file, L".png"))
            SavePng(image, command.file);
        else
            SaveBmp(image, command.file);
        Fact(L"screenshot " + command.file + L" " + std::to_wstring(image.width) + L"x" +
             std::to_wstring(image.height));
        break;
    }
    case Kind::Count:
        Fact(L"count " + std::to_wstring(FindWindows(command.window).size()));
        break;
    case Kind::Text:
        Fact(L"text " + EscapeControls(TextOf(WaitForWindow(command))));
        break;
    case Kind::Rect: {
        RECT rect{};
        GetWindowRect(WaitForWindow(command), &rect);
        Fact(L"rect " + std::to_wstring(rect.left) + L" " + std::to_wstring(rect.top) + L" " +
             std::to_wstring(rect.right - rect.left) + L" " + std::to_wstring(rect.bottom - rect.top));
        break;
    }
    case Kind::Rects:
        // Every match at once, without waiting: the thumbnails of a grid, however many there are.
        for (HWND hwnd : FindWindows(command.window)) {
            RECT rect{};
            GetWindowRect(hwnd, &rect);
            Fact(L"rect " + std::to_wstring(rect.left) + L" " + std::to_wstring(rect.top) + L" " +
                 std::to_wstring(rect.right - rect.left) + L" " + std::to_wstring(rect.bottom - rect.top));
        }
        break;
    case Kind::Windows:
        // Where each match is and what it says: which thumbnails a grid shows, in one look.
        for (HWND hwnd : FindWindows(command.window)) {
            RECT rect{};
            GetWindowRect(hwnd, &rect);
            Fact(L"window " + std::to_wstring(rect.left) + L" " + std::to_wstring(rect.top) + L" " +
                 std::to_wstring(rect.right - rect.left) + L" " + std::to_wstring(rect.bottom - rect.top) +
                 L" " + EscapeControls(TextOf(hwnd)));
        }
        break;
    case Kind::Enabled:
        Fact(L"enabled " + YesNo(IsWindowEnabled(WaitForWindow(command))));
        break;
    case Kind::Exists:
        Fact(L"exists " + YesNo(!FindWindows(command.window).empty()));
        break;
    case Kind::Call: {
        // The host's user-interface thread makes the call when its loop (inside a call: the library's)
        // dispatches the message to the host's frame.
        HWND frame = nullptr;
        for (HWND hwnd : ProcessWindows())
            if (ClassOf(hwnd) == L"DevhostFrame")
                frame = hwnd;
        auto expression = std::make_unique<std::wstring>(command.text);
        if (!frame || !PostMessageW(frame, WM_DEVHOST_CALL, 0, reinterpret_cast<LPARAM>(expression.get())))
            throw ScriptError{L"the host's frame cannot take the call"};
        expression.release(); // the frame's now
        Fact(L"call posted");
        Sleep(kSettleMs);
        break;
    }
    case Kind::Drag:
        Drag(WaitForWindow(command), command);
        Sleep(kSettleMs);
        break;
    case Kind::ScrollBar:
        Fact(DescribeScrollBar(WaitForWindow(command)));
        break;
    case Kind::Redraw: {
        // As another window moving off it would: the whole window painted again, background first; the
        // paint is sent to the window's own thread, and this waits until that thread has taken it.
        WaitForWindow(command);
        for (HWND hwnd : FindWindows(command.window))
            RedrawWindow(hwnd, nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_FRAME | RDW_UPDATENOW);
        Fact(L"redraw");
        Sleep(kSettleMs);
        break;
    }
    case Kind::Post: {
        // From this thread, as another program would: a posted message carries no sender.
        WaitForWindow(command);
        int posted = 0;
        for (HWND hwnd : FindWindows(command.window))
            posted += PostMessageW(hwnd, command.message, static_cast<WPARAM>(command.wParam),
                                   static_cast<LPARAM>(command.lParam)) != FALSE;
        Fact(L"post " + std::to_wstring(posted));
        Sleep(kSettleMs);
        break;
    }
    case Kind::Tooltip: {
        std::wstring text;
        for (HWND hwnd : ProcessWindows()) {
            if (IsWindowVisible(hwnd) && ClassOf(hwnd) == L"tooltips_class32") {
                text = TextOf(hwnd);
                if (!text.empty())
                    break;
            }
        }
        Fact(L"tooltip " + (text.empty() ? std::wstring(L"(none)") : EscapeControls(text)));
        break;
    }
    case Kind::Focus: {
        GUITHREADINFO info{};
        info.cbSize = sizeof info;
        if (GetGUIThreadInfo(m_uiThreadId, &info) && info.hwndFocus)
            Fact(L"focus " + ClassOf(info.hwndFocus) + L" id=" +
                 std::to_wstring(GetDlgCtrlID(info.hwndFocus)));
        else
            Fact(L"focus (none)");
        break;
    }
    case Kind::Returned: {
        const ULONGLONG deadline = GetTickCount64() + static_cast<ULONGLONG>(command.timeoutMs);
        while (CallsPending() > 0) {
            if (GetTickCount64() >= deadline)
                throw ScriptError{L"the calls have not returned within " +
                                  std::to_wstring(command.timeoutMs) + L" ms"};
            Sleep(kPollMs);
        }
        Fact(L"returned");
        break;
    }
    case Kind::DoubleClickTime:
        Fact(L"double-click-time " + std::to_wstring(GetDoubleClickTime()));
        break;
    case Kind::Typed:
        Fact(L"typed " + EscapeControls(TakeTypedText()));
        break;
    case Kind::Echo:
        Fact(command.text);
        break;
    case Kind::TreeSelect:
    case Kind::TreeExpand:
    case Kind::TreeCollapse:
    case Kind::TreeRightClick:
        DriveTree(WaitForWindow(command), command);
        Sleep(kSettleMs);
        break;
    case Kind::TreeItems:
        PrintTreeItems(WaitForWindow(command));
        break;
    case Kind::TreeCount: {
        // The tree's items, waited for until there are at least N (a node being filled), at most timeout.
        const HWND tree = WaitForWindow(command);
        const DWORD begin = GetTickCount();
        DWORD_PTR count = 0;
        for (;;) {
            if (!SendMessageTimeoutW(tree, TVM_GETCOUNT, 0, 0, SMTO_NORMAL, 1000, &count))
                count = 0; // busy: asked again
            if (static_cast<long long>(count) >= command.atLeast ||
                GetTickCount() - begin >= static_cast<DWORD>(command.timeoutMs))
                break;
            Sleep(100);
        }
        Fact(L"tree-count " + std::to_wstring(count));
        break;
    }
    case Kind::ClipboardPut:
        PutClipboardFiles(command);
        break;
    case Kind::ClipboardText:
        PutClipboardText(command.text);
        break;
    case Kind::ClipboardFiles:
        PrintClipboardFiles();
        break;
    case Kind::Remove:
        // As another program would, while the explorer shows the file.
        Fact(std::wstring(L"removed ") + (DeleteFileW(command.file.c_str()) ? L"yes" : L"no"));
        break;
    }
    return true;
}

} // namespace devhost
