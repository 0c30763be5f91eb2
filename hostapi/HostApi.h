// The library's view of its host: one table of the host's operations, bound by export name when the
// library is loaded, and a wrapper of the same name for each operation that degrades when the host
// lacks it. Portable: native tests fill the table with fakes.
#pragma once

#include "hostapi/arxhost.h"

#include <string>

struct HostApi {
#define ORVEX_HOST_FIELD(ret, name, params) ret(*name) params = nullptr;
    ORVEX_HOST_OPERATIONS(ORVEX_HOST_FIELD)
#undef ORVEX_HOST_FIELD
};

// The table the wrappers call through. Bound on first use (Windows: from the process's modules).
HostApi& Host();

// Replaces the whole table (tests) and marks it bound, so no binding is attempted.
void SetHostApi(const HostApi& api);

// Fills the table from the modules of the current process; returns how many operations were found.
// Implemented per platform: on Windows by GetProcAddress, natively it finds nothing.
int BindHostApi(HostApi& api);

// The names of the operations the host did not provide, in table order.
std::string MissingHostOperations();

// Says once per operation, on the host's command line (or the debugger when even printing is missing),
// that a feature is unavailable because the host lacks `operation`.
void ReportMissingHostOperation(const char* operation);
// The same when the library makes up for the operation itself: `instead` says what it does.
void ReportMissingHostOperation(const char* operation, const char* instead);

// Wrappers. Each calls the bound operation; when the host lacks it, it reports that once and returns
// the failure value of the operation (RTERROR, nullptr, false, 0).
int acedDefun(const wchar_t* name, int funcNumber);
int acedUndef(const wchar_t* name, int funcNumber);
int acedGetFunCode();
resbuf* acedGetArgs();
int acedRetList(const resbuf* list);
int acedRetNil();
int acedRetVoid();
resbuf* acutNewRb(int restype);
int acutRelRb(resbuf* rb);
int acutPrintf(const wchar_t* format, ...);
int acedAlert(const wchar_t* text);
void acdbFail(const wchar_t* text);
AcApDocManager* acDocManagerPtr();
AcRxDictionary* acrxSysRegistry();
const AcRxClass* acrxDynamicLinkerDesc();
HWND acedGetAcadFrame();
HWND acedGetAcadWinApp();
HWND acedGetAcadDwgView();
bool acdbGetLayerColor(const wchar_t* layerName, int* colorIndex);
bool acedSetColorDialog(int* colorIndex, bool allowMetaColor, int currentLayerColor);
std::uint32_t acedGetRGB(int colorIndex);
bool acdbDisplayPreviewFromDwg(const wchar_t* fileName, HWND window, const std::uint32_t* bgColor);
int onLoadArxApp(const wchar_t* moduleFileName);
int onUnloadArxApp(const wchar_t* moduleFileName);
void* odrxAlloc(std::size_t size);
void odrxFree(void* block);

// acutBuildList is variadic in the host; the library only ever builds one-node lists, so it has typed
// forms. Each returns nullptr when the host lacks the operation or cannot allocate.
resbuf* acutBuildListString(const wchar_t* text);
resbuf* acutBuildListCode(short restype); // RTLB, RTLE, RTNIL: no value
