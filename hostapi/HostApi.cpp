#include "hostapi/HostApi.h"

#include <cstdarg>
#include <cstdio>
#include <cwchar>
#include <set>
#include <string>

namespace {

struct HostState {
    HostApi api;
    bool bound = false;
    std::set<std::string> reported; // operations already reported missing
};

HostState& State() {
    static HostState state; // first use may be during static initialisation of the library
    return state;
}

} // namespace

HostApi& Host() {
    HostState& s = State();
    if (!s.bound) {
        s.bound = true;
        BindHostApi(s.api);
    }
    return s.api;
}

void SetHostApi(const HostApi& api) {
    HostState& s = State();
    s.api = api;
    s.bound = true;
    s.reported.clear();
}

std::string MissingHostOperations() {
    const HostApi& api = Host();
    std::string missing;
#define ORVEX_HOST_MISSING(ret, name, params)                                                                \
    if (!api.name)                                                                                           \
        missing += missing.empty() ? #name : " " #name;
    ORVEX_HOST_OPERATIONS(ORVEX_HOST_MISSING)
#undef ORVEX_HOST_MISSING
    return missing;
}

void WriteDebuggerLine(const char* text); // per platform, beside BindHostApi

void ReportMissingHostOperation(const char* operation) {
    ReportMissingHostOperation(operation, "that feature is not available");
}

void ReportMissingHostOperation(const char* operation, const char* instead) {
    HostState& s = State();
    if (!s.reported.insert(operation).second)
        return;
    std::string line = "\nOrvex1: the host does not provide ";
    line += operation;
    line += "; ";
    line += instead;
    line += ".\n";
    if (s.api.acutPrintf) {
        std::wstring wide(line.begin(), line.end()); // the text is plain ASCII
        s.api.acutPrintf(L"%ls", wide.c_str());
    } else {
        WriteDebuggerLine(line.c_str());
    }
}

#define ORVEX_CALL_OR(name, failure, ...)                                                                    \
    do {                                                                                                     \
        if (auto fn = Host().name)                                                                           \
            return fn(__VA_ARGS__);                                                                          \
        ReportMissingHostOperation(#name);                                                                   \
        return failure;                                                                                      \
    } while (0)

int acedDefun(const wchar_t* name, int funcNumber) {
    ORVEX_CALL_OR(acedDefun, RTERROR, name, funcNumber);
}
int acedUndef(const wchar_t* name, int funcNumber) {
    ORVEX_CALL_OR(acedUndef, RTERROR, name, funcNumber);
}
int acedGetFunCode() {
    ORVEX_CALL_OR(acedGetFunCode, RTERROR);
}
resbuf* acedGetArgs() {
    ORVEX_CALL_OR(acedGetArgs, nullptr);
}
int acedRetList(const resbuf* list) {
    ORVEX_CALL_OR(acedRetList, RTERROR, list);
}
int acedRetNil() {
    ORVEX_CALL_OR(acedRetNil, RTERROR);
}
int acedRetVoid() {
    ORVEX_CALL_OR(acedRetVoid, RTERROR);
}
resbuf* acutNewRb(int restype) {
    ORVEX_CALL_OR(acutNewRb, nullptr, restype);
}
int acutRelRb(resbuf* rb) {
    ORVEX_CALL_OR(acutRelRb, RTERROR, rb);
}
int acedAlert(const wchar_t* text) {
    ORVEX_CALL_OR(acedAlert, RTERROR, text);
}
AcApDocManager* acDocManagerPtr() {
    ORVEX_CALL_OR(acDocManagerPtr, nullptr);
}
AcRxDictionary* acrxSysRegistry() {
    ORVEX_CALL_OR(acrxSysRegistry, nullptr);
}
const AcRxClass* acrxDynamicLinkerDesc() {
    ORVEX_CALL_OR(acrxDynamicLinkerDesc, nullptr);
}
HWND acedGetAcadFrame() {
    ORVEX_CALL_OR(acedGetAcadFrame, nullptr);
}
HWND acedGetAcadWinApp() {
    ORVEX_CALL_OR(acedGetAcadWinApp, nullptr);
}
HWND acedGetAcadDwgView() {
    ORVEX_CALL_OR(acedGetAcadDwgView, nullptr);
}
bool acdbGetLayerColor(const wchar_t* layerName, int* colorIndex) {
    ORVEX_CALL_OR(acdbGetLayerColor, false, layerName, colorIndex);
}
bool acedSetColorDialog(int* colorIndex, bool allowMetaColor, int currentLayerColor) {
    ORVEX_CALL_OR(acedSetColorDialog, false, colorIndex, allowMetaColor, currentLayerColor);
}
std::uint32_t acedGetRGB(int colorIndex) {
    ORVEX_CALL_OR(acedGetRGB, 0u, colorIndex);
}
bool acdbDisplayPreviewFromDwg(const wchar_t* fileName, HWND window, const std::uint32_t* bgColor) {
    ORVEX_CALL_OR(acdbDisplayPreviewFromDwg, false, fileName, window, bgColor);
}
int onLoadArxApp(const wchar_t* moduleFileName) {
    ORVEX_CALL_OR(onLoadArxApp, RTERROR, moduleFileName);
}
int onUnloadArxApp(const wchar_t* moduleFileName) {
    ORVEX_CALL_OR(onUnloadArxApp, RTERROR, moduleFileName);
}
void* odrxAlloc(std::size_t size) {
    ORVEX_CALL_OR(odrxAlloc, nullptr, size);
}

void odrxFree(void* block) {
    if (auto fn = Host().odrxFree)
        fn(block);
    else
        ReportMissingHostOperation("odrxFree");
}

void acdbFail(const wchar_t* text) {
    if (auto fn = Host().acdbFail)
        fn(text);
    else
        ReportMissingHostOperation("acdbFail");
}

int acutPrintf(const wchar_t* format, ...) {
    auto fn = Host().acutPrintf;
    if (!fn) {
        ReportMissingHostOperation("acutPrintf");
        return RTERROR;
    }
    wchar_t text[2048];
    va_list args;
    va_start(args, format);
    int n = std::vswprintf(text, sizeof text / sizeof text[0], format, args);
    va_end(args);
    if (n < 0) // too long for one line of the command line: print it cut rather than not at all
        text[sizeof text / sizeof text[0] - 1] = 0;
    return fn(L"%ls", text);
}

resbuf* acutBuildListString(const wchar_t* text) {
    ORVEX_CALL_OR(acutBuildList, nullptr, RTSTR, text, 0);
}
resbuf* acutBuildListCode(short restype) {
    ORVEX_CALL_OR(acutBuildList, nullptr, static_cast<int>(restype), 0);
}
