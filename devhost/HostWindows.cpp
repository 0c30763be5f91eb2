#include "devhost/HostWindows.h"

#include <memory>
#include <mutex>

namespace devhost {

const wchar_t* const kFrameClass = L"DevhostFrame";
const wchar_t* const kViewClass = L"DevhostDrawingView";

namespace {

constexpr int kFirstViewId = 0xE900;

std::mutex g_typedMutex;
std::wstring g_typed;

void NoteTyped(wchar_t character) {
    const std::lock_guard<std::mutex> lock(g_typedMutex);
    g_typed += character;
}

// A drawing view: a white sheet with the drawing's name, and a focus frame when it has the focus.
class DrawingView final : public HostWindow {
public:
    explicit DrawingView(std::wstring name) : m_name(std::move(name)) {}

    HWND Create(HWND frame, int index) {
        return CreateWindowExW(0, kViewClass, m_name.c_str(), WS_CHILD | WS_CLIPSIBLINGS | WS_TABSTOP, 0, 0,
                               10, 10, frame,
                               reinterpret_cast<HMENU>(static_cast<INT_PTR>(kFirstViewId + index)),
                               GetModuleHandleW(nullptr), this);
    }

protected:
    LRESULT HandleMessage(UINT message, WPARAM wParam, LPARAM lParam) override {
        switch (message) {
        case WM_PAINT:
            OnPaint();
            return 0;
        case WM_SETFOCUS:
        case WM_KILLFOCUS:
            InvalidateRect(m_hwnd, nullptr, TRUE);
            return 0;
        case WM_LBUTTONDOWN:
            SetFocus(m_hwnd);
            return 0;
        case WM_CHAR: // the drawing takes keyboard input: what a user types after a call arrives here
            NoteTyped(static_cast<wchar_t>(wParam));
            return 0;
        case WM_NCDESTROY: {
            const LRESULT result = HostWindow::HandleMessage(message, wParam, lParam);
            delete this; // the view object lives as long as its window
            return result;
        }
        default:
            return HostWindow::HandleMessage(message, wParam, lParam);
        }
    }

private:
    void OnPaint() {
        PAINTSTRUCT paint;
        HDC dc = BeginPaint(m_hwnd, &paint);
        RECT client;
        GetClientRect(m_hwnd, &client);
        FillRect(dc, &client, static_cast<HBRUSH>(GetStockObject(WHITE_BRUSH)));
        SetBkMode(dc, TRANSPARENT);
        DrawTextW(dc, m_name.c_str(), -1, &client, DT_CENTER | DT_VCENTER | DT_SINGLELINE);
        if (GetFocus() == m_hwnd) {
            RECT inner = client;
            InflateRect(&inner, -2, -2);
            DrawFocusRect(dc, &inner);
        }
        EndPaint(m_hwnd, &paint);
    }

    std::wstring m_name;
};

} // namespace

std::wstring TakeTypedText() {
    const std::lock_guard<std::mutex> lock(g_typedMutex);
    std::wstring text;
    text.swap(g_typed);
    return text;
}

LRESULT CALLBACK HostWindow::Procedure(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    HostWindow* self = nullptr;
    if (message == WM_NCCREATE) {
        self = static_cast<HostWindow*>(reinterpret_cast<CREATESTRUCTW*>(lParam)->lpCreateParams);
        self->m_hwnd = hwnd;
        SetWindowLongPtrW(hwnd, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(self));
    } else {
        self = reinterpret_cast<HostWindow*>(GetWindowLongPtrW(hwnd, GWLP_USERDATA));
    }
    if (!self)
        return DefWindowProcW(hwnd, message, wParam, lParam);
    try {
        return self->HandleMessage(message, wParam, lParam);
    } catch (...) {
        return DefWindowProcW(hwnd, message, wParam, lParam);
    }
}

LRESULT HostWindow::HandleMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    const HWND hwnd = m_hwnd;
    if (message == WM_NCDESTROY) {
        SetWindowLongPtrW(hwnd, GWLP_USERDATA, 0);
        m_hwnd = nullptr;
    }
    return DefWindowProcW(hwnd, message, wParam, lParam);
}

bool RegisterHostClasses() {
    WNDCLASSEXW frameClass{};
    frameClass.cbSize = sizeof frameClass;
    frameClass.lpfnWndProc = &HostWindow::Procedure;
    frameClass.hInstance = GetModuleHandleW(nullptr);
    frameClass.hCursor = LoadCursorW(nullptr, MAKEINTRESOURCEW(32512)); // IDC_ARROW
    frameClass.hbrBackground = reinterpret_cast<HBRUSH>(COLOR_APPWORKSPACE + 1);
    frameClass.lpszClassName = kFrameClass;
    WNDCLASSEXW viewClass = frameClass;
    viewClass.style = CS_DBLCLKS;
    viewClass.hbrBackground = nullptr;
    viewClass.lpszClassName = kViewClass;
    return RegisterClassExW(&frameClass) && RegisterClassExW(&viewClass);
}

bool FrameWindow::Create() {
    CreateWindowExW(0, kFrameClass, L"devhost", WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN, 20, 20, 800, 600,
                    nullptr, nullptr, GetModuleHandleW(nullptr), this);
    if (!m_hwnd)
        return false;
    ShowWindow(m_hwnd, SW_SHOWNORMAL);
    UpdateWindow(m_hwnd);
    SetForegroundWindow(m_hwnd);
    return true;
}

void FrameWindow::Destroy() {
    if (m_hwnd)
        DestroyWindow(m_hwnd);
}

LRESULT FrameWindow::HandleMessage(UINT message, WPARAM wParam, LPARAM lParam) {
    switch (message) {
    case WM_SIZE:
        OnSize();
        return 0;
    case WM_CLOSE: // the host's frame closes only when devhost ends
        return 0;
    case WM_DEVHOST_CALL: {
        std::unique_ptr<std::wstring> expression(reinterpret_cast<std::wstring*>(lParam));
        if (expression && onCall)
            onCall(*expression);
        return 0;
    }
    default:
        return HostWindow::HandleMessage(message, wParam, lParam);
    }
}

void FrameWindow::OnSize() {
    RECT client;
    GetClientRect(m_hwnd, &client);
    for (HWND child = GetWindow(m_hwnd, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT))
        MoveWindow(child, 0, 0, client.right, client.bottom, TRUE);
}

HWND CreateDrawingView(HWND frame, const std::wstring& documentName, int index) {
    auto view = std::make_unique<DrawingView>(documentName);
    HWND hwnd = view->Create(frame, index);
    if (hwnd)
        view.release(); // now owned by its window (deleted on WM_NCDESTROY)
    return hwnd;
}

void ShowOnlyView(HWND frame, HWND view) {
    RECT client;
    GetClientRect(frame, &client);
    if (view) {
        MoveWindow(view, 0, 0, client.right, client.bottom, FALSE);
        ShowWindow(view, SW_SHOW);
    }
    for (HWND child = GetWindow(frame, GW_CHILD); child; child = GetWindow(child, GW_HWNDNEXT))
        if (child != view)
            ShowWindow(child, SW_HIDE);
}

} // namespace devhost
