// The entry point's message dispatch and the table of the library's LISP functions.
#pragma once

#include "hostapi/arxhost.h"

struct PickerPlatform;

struct LispFunction {
    const wchar_t* name; // as the host's LISP sees it
    int (*function)(PickerPlatform& platform);
};

// A function's code (for acedDefun and acedGetFunCode) is its index here.
extern const LispFunction g_lispFunctions[];
constexpr int kLispFunctionCount = 1;

// Handles one message of the host's entry point; a LISP function it calls runs on `platform`, which the
// module owns. Always returns kRetOK.
AcRx::AppRetCode DispatchEntryMessage(int message, void* appId, PickerPlatform& platform);

// The version both version exports report.
void ApiVersion(std::uint32_t* major, std::uint32_t* minor, std::uint32_t* build, std::uint32_t* patch);
