// The host operations, exported by name from devhost.exe: the library finds them with GetProcAddress.
// None lets an exception out: the caller is the library, across a module boundary.
#include "devhost/ColorDialog.h"
#include "devhost/HostObjects.h"
#include "devhost/HostPrintf.h"
#include "devhost/Output.h"
#include "devhost/Palette.h"
#include "devhost/ResultBuffers.h"
#include "devhost/Text.h"
#include "devhost/Timing.h"

#ifdef DEVHOST_HAVE_DWGPREVIEW
#include "preview/DrawPreview.h"
#endif

#include <cstdarg>
#include <cstdlib>

#define DEVHOST_DECLARE_EXPORT(ret, name, params) extern "C" __declspec(dllexport) ret name params;
ORVEX_HOST_OPERATIONS(DEVHOST_DECLARE_EXPORT)
#undef DEVHOST_DECLARE_EXPORT

using namespace devhost;

namespace {

const COLORREF kFlatPreviewColor = RGB(0x40, 0x80, 0xB0);

void Verbose(const std::wstring& line) {
    if (Host().options.verbose)
        WriteLine(L"[host] " + line);
}

// Runs body; what it throws (out of memory while building text) becomes the fallback result.
template <class Result, class Body> Result Guarded(Result fallback, Body body) {
    try {
        return body();
    } catch (...) {
        return fallback;
    }
}

#ifndef DEVHOST_WITHOUT_PREVIEW_OPERATION
// --preview flat: the whole client area in one colour, whatever the file (which is not opened), so that
// every picture costs the same small time and a benchmark sees the library's own share.
bool FillWithFlatPreview(HWND window) {
    RECT client;
    if (!GetClientRect(window, &client))
        return false;
    HDC dc = GetDC(window);
    if (!dc)
        return false;
    HBRUSH brush = CreateSolidBrush(kFlatPreviewColor);
    const bool filled = brush && FillRect(dc, &client, brush) != 0;
    if (brush)
        DeleteObject(brush);
    ReleaseDC(window, dc);
    return filled;
}
#endif

std::wstring Text(const wchar_t* text) {
    return text ? std::wstring(text) : std::wstring();
}

} // namespace

int acedDefun(const wchar_t* name, int funcNumber) {
    return Guarded(static_cast<int>(RTERROR), [&] {
        AcApDocument* document = Host().docManager.curDocument();
        if (!name || !*name || !document)
            return static_cast<int>(RTERROR);
        document->Functions()[LowerCase(name)] = funcNumber;
        Verbose(L"acedDefun " + Text(name) + L" " + std::to_wstring(funcNumber) + L" in " + document->Name());
        return static_cast<int>(RTNORM);
    });
}

int acedUndef(const wchar_t* name, int funcNumber) {
    return Guarded(static_cast<int>(RTERROR), [&] {
        AcApDocument* document = Host().docManager.curDocument();
        if (!name || !document)
            return static_cast<int>(RTERROR);
        auto& functions = document->Functions();
        const auto found = functions.find(LowerCase(name));
        if (found == functions.end() || found->second != funcNumber)
            return static_cast<int>(RTERROR);
        functions.erase(found);
        Verbose(L"acedUndef " + Text(name) + L" " + std::to_wstring(funcNumber) + L" in " + document->Name());
        return static_cast<int>(RTNORM);
    });
}

int acedGetFunCode() {
    return Host().inCall ? Host().functionCode : RTERROR;
}

resbuf* acedGetArgs() {
    HostState& host = Host();
    if (!host.inCall || !host.args || host.liveArgNodes.count(host.args) == 0)
        return nullptr;
    return host.args;
}

int acedRetList(const resbuf* list) {
    HostState& host = Host();
    if (!host.inCall)
        return RTERROR;
    resbuf* copy = CopyChain(list);
    if (list && !copy)
        return RTERROR;
    FreeChain(host.resultList);
    host.resultList = copy;
    host.result = CallResult::List;
    return RTNORM;
}

int acedRetNil() {
    HostState& host = Host();
    if (!host.inCall)
        return RTERROR;
    FreeChain(host.resultList);
    host.resultList = nullptr;
    host.result = CallResult::Nil;
    return RTNORM;
}

int acedRetVoid() {
    HostState& host = Host();
    if (!host.inCall)
        return RTERROR;
    FreeChain(host.resultList);
    host.resultList = nullptr;
    host.result = CallResult::Void;
    return RTNORM;
}

resbuf* acutBuildList(int restype, ...) {
    va_list values;
    va_start(values, restype);
    resbuf* chain = BuildChainV(restype, values);
    va_end(values);
    return chain;
}

resbuf* acutNewRb(int restype) {
    return NewNode(restype);
}

int acutRelRb(resbuf* rb) {
    return Guarded(static_cast<int>(RTERROR), [&] {
        // Nodes of the call's arguments that the library frees are no longer the host's to free.
        HostState& host = Host();
        for (const resbuf* node = rb; node && !host.liveArgNodes.empty(); node = node->rbnext)
            host.liveArgNodes.erase(node);
        FreeChain(rb);
        return static_cast<int>(RTNORM);
    });
}

int acutPrintf(const wchar_t* format, ...) {
    va_list args;
    va_start(args, format);
    const int written = Guarded(0, [&] {
        const std::wstring text = FormatHostText(format, args);
        WriteText(text);
        return static_cast<int>(text.size());
    });
    va_end(args);
    return written;
}

int acedAlert(const wchar_t* text) {
    return Guarded(static_cast<int>(RTERROR), [&] {
        WriteLine(L"[alert] " + EscapeControls(Text(text)));
        if (Host().options.alertBox)
            MessageBoxW(GetActiveWindow(), text ? text : L"", L"devhost", MB_OK | MB_ICONINFORMATION);
        return static_cast<int>(RTNORM);
    });
}

void acdbFail(const wchar_t* text) {
    Guarded(0, [&] {
        WriteLine(L"[fail] " + EscapeControls(Text(text)));
        return 0;
    });
}

AcApDocManager* acDocManagerPtr() {
    return &Host().docManager;
}

AcRxDictionary* acrxSysRegistry() {
    return &Host().registry;
}

const AcRxClass* acrxDynamicLinkerDesc() {
    return DynamicLinkerClass();
}

HWND acedGetAcadFrame() {
    return Host().frame;
}

HWND acedGetAcadWinApp() {
    return Host().frame;
}

HWND acedGetAcadDwgView() {
    AcApDocument* document = Host().docManager.curDocument();
    return document ? document->View() : nullptr;
}

bool acdbGetLayerColor(const wchar_t* layerName, int* colorIndex) {
    return Guarded(false, [&] {
        if (!layerName)
            return false;
        const auto& layers = Host().layers;
        const auto found = layers.find(UpperCase(layerName));
        if (found == layers.end())
            return false;
        if (colorIndex)
            *colorIndex = found->second;
        return true;
    });
}

bool acedSetColorDialog(int* colorIndex, bool allowMetaColor, int currentLayerColor) {
    return Guarded(false, [&] {
        if (!colorIndex)
            return false;
        Verbose(L"acedSetColorDialog " + std::to_wstring(*colorIndex) + (allowMetaColor ? L" logical" : L""));
        const bool chosen = RunColorDialog(colorIndex, allowMetaColor, currentLayerColor);
        Verbose(chosen ? L"acedSetColorDialog chose " + std::to_wstring(*colorIndex)
                       : std::wstring(L"acedSetColorDialog cancelled"));
        return chosen;
    });
}

std::uint32_t acedGetRGB(int colorIndex) {
    return PaletteColorRef(colorIndex);
}

// Declared exported above, but a function that is not defined here is not exported: the variant without
// the operation plays a host that lacks it.
#ifndef DEVHOST_WITHOUT_PREVIEW_OPERATION
bool acdbDisplayPreviewFromDwg(const wchar_t* fileName, HWND window, const std::uint32_t* bgColor) {
    return Guarded(false, [&] {
        if (!fileName || !window || !IsWindow(window))
            return false;
        bool drawn = false;
        if (Host().options.preview == Options::Preview::Flat) {
            drawn = FillWithFlatPreview(window);
        } else {
#ifdef DEVHOST_HAVE_DWGPREVIEW
            const COLORREF background = bgColor ? static_cast<COLORREF>(*bgColor) : GetSysColor(COLOR_WINDOW);
            drawn = DrawDwgPreviewInWindow(window, fileName, background);
#else
            return false;
#endif
        }
        TimingPreviewDrawn(window, fileName);
        return drawn;
    });
}
#endif

int onLoadArxApp(const wchar_t* moduleFileName) {
    Guarded(0, [&] {
        Verbose(L"onLoadArxApp " + Text(moduleFileName));
        return 0;
    });
    return RTNORM;
}

int onUnloadArxApp(const wchar_t* moduleFileName) {
    Guarded(0, [&] {
        Verbose(L"onUnloadArxApp " + Text(moduleFileName));
        return 0;
    });
    return RTNORM;
}

void* odrxAlloc(std::size_t size) {
    return std::malloc(size ? size : 1);
}

void odrxFree(void* block) {
    std::free(block);
}
