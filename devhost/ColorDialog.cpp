#include "devhost/ColorDialog.h"

#include "devhost/HostObjects.h"
#include "devhost/Palette.h"

#include <atomic>
#include <string>

namespace devhost {

const wchar_t* const kColorDialogClass = L"DevhostColorDialog";
const wchar_t* const kSwatchClass = L"DevhostSwatch";

namespace {

// Layout in pixels: the 240 hues and shades (10..249) as 24 columns of 10, then the nine standard
// colours (1..9) and the six greys (250..255) in a row below.
constexpr int kMargin = 10;
constexpr int kCell = 16;
constexpr int kPitch = 18;
constexpr int kHueColumns = 24;
constexpr int kShadeRows = 10;
constexpr int kPaletteWidth = kHueColumns * kPitch;
constexpr int kStandardTop = kMargin + kShadeRows * kPitch + 10;
constexpr int kButtonsTop = kStandardTop + kPitch + 12;
constexpr int kButtonHeight = 24;
constexpr int kClientWidth = 2 * kMargin + kPaletteWidth;
constexpr int kClientHeight = kButtonsTop + 2 * kButtonHeight + 8 + kMargin;

std::atomic<HWND> g_open{nullptr};

struct DialogState {
    int chosen = 7;
    bool allowMeta = false;
    bool done = false;
    bool confirmed = false;
    HWND hwnd = nullptr;
};

POINT SwatchPosition(int index) {
    if (index >= 10 && index <= 249) {
        const int column = (index - 10) / kShadeRows, row = (index - 10) % kShadeRows;
        return {kMargin + column * kPitch, kMargin + row * kPitch};
    }
    if (index >= 1 && index <= 9)
        return {kMargin + (index - 1) * kPitch, kStandardTop};
    // 250..255 at the right end of the standard row.
    return {kMargin + kPaletteWidth - (256 - index) * kPitch, kStandardTop};
}

std::wstring ChosenText(int index) {
    if (index == 0)
        return L"Color ByBlock";
    if (index == 256)
        return L"Color ByLayer";
    return L"Color " + std::to_wstring(index);
}

void Choose(DialogState& state, int index) {
    const int previous = state.chosen;
    state.chosen = index;
    if (HWND old = GetDlgItem(state.hwnd, kFirstSwatchId + previous))
        InvalidateRect(old, nullptr, TRUE);
    if (HWND now = GetDlgItem(state.hwnd, kFirstSwatchId + index))
        InvalidateRect(now, nullptr, TRUE);
    SetDlgItemTextW(state.hwnd, kChosenTextId, ChosenText(index).c_str());
    InvalidateRect(GetDlgItem(state.hwnd, kChosenSampleId), nullptr, TRUE);
}

void Finish(DialogState& state, bool confirmed) {
    state.confirmed = confirmed;
    state.done = true;
}

DialogState* StateOf(HWND dialog) {
    return reinterpret_cast<DialogState*>(GetWindowLongPtrW(dialog, GWLP_USERDATA));
}

// A swatch: its colour index is its control id less kFirstSwatchId (the sample shows the chosen one).
LRESULT CALLBACK SwatchProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    HWND dialog = GetParent(hwnd);
    DialogState* state = dialog ? StateOf(dialog) : nullptr;
    const int id = GetDlgCtrlID(hwnd);
    switch (message) {
    case WM_PAINT: {
        PAINTSTRUCT ps;
        HDC dc = BeginPaint(hwnd, &ps);
        RECT rc;
        GetClientRect(hwnd, &rc);
        const int index = id == kChosenSampleId ? (state ? state->chosen : 7) : id - kFirstSwatchId;
        const bool logical = index == 0 || index == 256;
        HBRUSH fill = CreateSolidBrush(logical ? GetSysColor(COLOR_BTNFACE) : PaletteColorRef(index));
        FillRect(dc, &rc, fill);
        DeleteObject(fill);
        FrameRect(dc, &rc, static_cast<HBRUSH>(GetStockObject(GRAY_BRUSH)));
        if (state && id != kChosenSampleId && index == state->chosen) {
            // The chosen swatch: a black and a white frame, visible on any colour.
            FrameRect(dc, &rc, static_cast<HBRUSH>(GetStockObject(BLACK_BRUSH)));
            InflateRect(&rc, -1, -1);
            FrameRect(dc, &rc, static_cast<HBRUSH>(GetStockObject(WHITE_BRUSH)));
            InflateRect(&rc, -1, -1);
            FrameRect(dc, &rc, static_cast<HBRUSH>(GetStockObject(BLACK_BRUSH)));
        }
        EndPaint(hwnd, &ps);
        return 0;
    }
    case WM_LBUTTONDOWN:
        if (state && id != kChosenSampleId)
            Choose(*state, id - kFirstSwatchId);
        return 0;
    case WM_LBUTTONDBLCLK: // a double click confirms the colour
        if (state && id != kChosenSampleId) {
            Choose(*state, id - kFirstSwatchId);
            Finish(*state, true);
        }
        return 0;
    default:
        return DefWindowProcW(hwnd, message, wParam, lParam);
    }
}

LRESULT CALLBACK DialogProc(HWND hwnd, UINT message, WPARAM wParam, LPARAM lParam) {
    if (message == WM_NCCREATE) {
        auto* state = static_cast<DialogState*>(reinterpret_cast<CREATESTRUCTW*>(lParam)->lpCreateParams);
        SetWindowLongPtrW(hwnd, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(state));
        state->hwnd = hwnd;
    }
    DialogState* state = StateOf(hwnd);
    switch (message) {
    case WM_COMMAND:
        if (!state || HIWORD(wParam) != BN_CLICKED)
            break;
        switch (LOWORD(wParam)) {
        case IDOK:
            Finish(*state, true);
            return 0;
        case IDCANCEL:
            Finish(*state, false);
            return 0;
        case kByBlockId:
            Choose(*state, 0);
            return 0;
        case kByLayerId:
            Choose(*state, 256);
            return 0;
        default:
            break;
        }
        break;
    case WM_CLOSE:
        if (state)
            Finish(*state, false);
        return 0;
    case WM_NCDESTROY:
        SetWindowLongPtrW(hwnd, GWLP_USERDATA, 0);
        break;
    default:
        break;
    }
    return DefWindowProcW(hwnd, message, wParam, lParam);
}

bool RegisterClasses(HINSTANCE instance) {
    WNDCLASSEXW wc{};
    wc.cbSize = sizeof wc;
    wc.hInstance = instance;
    wc.hCursor = LoadCursorW(nullptr, MAKEINTRESOURCEW(32512)); // IDC_ARROW
    if (!GetClassInfoExW(instance, kColorDialogClass, &wc)) {
        wc.lpfnWndProc = DialogProc;
        wc.hbrBackground = GetSysColorBrush(COLOR_BTNFACE);
        wc.lpszClassName = kColorDialogClass;
        if (!RegisterClassExW(&wc))
            return false;
    }
    WNDCLASSEXW swatch{};
    swatch.cbSize = sizeof swatch;
    if (!GetClassInfoExW(instance, kSwatchClass, &swatch)) {
        swatch.hInstance = instance;
        swatch.hCursor = wc.hCursor;
        swatch.style = CS_DBLCLKS;
        swatch.lpfnWndProc = SwatchProc;
        swatch.lpszClassName = kSwatchClass;
        if (!RegisterClassExW(&swatch))
            return false;
    }
    return true;
}

HWND Child(HWND parent, const wchar_t* cls, const wchar_t* text, DWORD style, int x, int y, int w, int h,
           int id) {
    HWND child = CreateWindowExW(0, cls, text, WS_CHILD | WS_VISIBLE | style, x, y, w, h, parent,
                                 reinterpret_cast<HMENU>(static_cast<INT_PTR>(id)), GetModuleHandleW(nullptr),
                                 nullptr);
    SendMessageW(child, WM_SETFONT, reinterpret_cast<WPARAM>(GetStockObject(DEFAULT_GUI_FONT)), FALSE);
    return child;
}

void CreateControls(HWND dialog, const DialogState& state) {
    for (int index = 1; index <= 255; ++index) {
        const POINT at = SwatchPosition(index);
        Child(dialog, kSwatchClass, std::to_wstring(index).c_str(), 0, at.x, at.y, kCell, kCell,
              kFirstSwatchId + index);
    }
    const int y = kButtonsTop;
    HWND byLayer = Child(dialog, L"BUTTON", L"ByLayer", BS_PUSHBUTTON | WS_TABSTOP, kMargin, y, 80,
                         kButtonHeight, kByLayerId);
    HWND byBlock = Child(dialog, L"BUTTON", L"ByBlock", BS_PUSHBUTTON | WS_TABSTOP, kMargin + 88, y, 80,
                         kButtonHeight, kByBlockId);
    EnableWindow(byLayer, state.allowMeta);
    EnableWindow(byBlock, state.allowMeta);
    Child(dialog, L"STATIC", ChosenText(state.chosen).c_str(), SS_LEFT | SS_CENTERIMAGE, kMargin + 190, y,
          110, kButtonHeight, kChosenTextId);
    Child(dialog, kSwatchClass, L"", 0, kMargin + 300, y, 48, kButtonHeight, kChosenSampleId);
    const int buttons = y + kButtonHeight + 8;
    Child(dialog, L"BUTTON", L"OK", BS_DEFPUSHBUTTON | WS_TABSTOP, kClientWidth - kMargin - 168, buttons, 80,
          kButtonHeight, IDOK);
    Child(dialog, L"BUTTON", L"Cancel", BS_PUSHBUTTON | WS_TABSTOP, kClientWidth - kMargin - 80, buttons, 80,
          kButtonHeight, IDCANCEL);
}

} // namespace

bool RunColorDialog(int* colorIndex, bool allowMetaColor, int currentLayerColor) {
    HINSTANCE instance = GetModuleHandleW(nullptr);
    if (!colorIndex || !RegisterClasses(instance) || g_open.load())
        return false;
    DialogState state;
    state.allowMeta = allowMetaColor;
    state.chosen = *colorIndex;
    if (state.chosen < 0 || state.chosen > 256 ||
        (!allowMetaColor && (state.chosen == 0 || state.chosen == 256)))
        state.chosen = 7;

    HWND owner = GetActiveWindow();
    if (!owner)
        owner = Host().frame;
    const DWORD style = WS_POPUP | WS_CAPTION | WS_SYSMENU | DS_MODALFRAME;
    RECT rc{0, 0, kClientWidth, kClientHeight};
    AdjustWindowRectEx(&rc, style, FALSE, WS_EX_DLGMODALFRAME);
    const int width = rc.right - rc.left, height = rc.bottom - rc.top;
    RECT ownerRect{0, 0, GetSystemMetrics(SM_CXSCREEN), GetSystemMetrics(SM_CYSCREEN)};
    if (owner)
        GetWindowRect(owner, &ownerRect);
    const int x = (ownerRect.left + ownerRect.right - width) / 2,
              y = (ownerRect.top + ownerRect.bottom - height) / 2;
    HWND dialog =
        CreateWindowExW(WS_EX_DLGMODALFRAME | WS_EX_CONTROLPARENT, kColorDialogClass, L"Select Color", style,
                        x > 0 ? x : 0, y > 0 ? y : 0, width, height, owner, nullptr, instance, &state);
    if (!dialog)
        return false;
    CreateControls(dialog, state);
    (void)currentLayerColor; // ByLayer shows no colour of its own here

    const bool ownerWasEnabled = owner && IsWindowEnabled(owner);
    if (ownerWasEnabled)
        EnableWindow(owner, FALSE);
    g_open = dialog;
    ShowWindow(dialog, SW_SHOWNORMAL);
    SetFocus(GetDlgItem(dialog, IDOK));

    MSG msg;
    while (!state.done) {
        const BOOL got = GetMessageW(&msg, nullptr, 0, 0);
        if (got <= 0) {
            PostQuitMessage(static_cast<int>(msg.wParam)); // the outer loop sees it too
            break;
        }
        if (msg.message == WM_KEYDOWN && (msg.hwnd == dialog || IsChild(dialog, msg.hwnd)) &&
            (msg.wParam == VK_ESCAPE || msg.wParam == VK_RETURN)) {
            Finish(state, msg.wParam == VK_RETURN);
            continue;
        }
        if (IsDialogMessageW(dialog, &msg))
            continue;
        TranslateMessage(&msg);
        DispatchMessageW(&msg);
    }
    g_open = nullptr;
    if (ownerWasEnabled)
        EnableWindow(owner, TRUE);
    if (owner && GetActiveWindow() == dialog)
        SetActiveWindow(owner);
    DestroyWindow(dialog);
    if (state.confirmed)
        *colorIndex = state.chosen;
    return state.confirmed;
}

void CancelColorDialog() {
    if (HWND dialog = g_open.load())
        PostMessageW(dialog, WM_CLOSE, 0, 0);
}

} // namespace devhost
