#include "hostapi/Guard.h"

#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"

void ReportLibraryError(const char* where, const char* what) {
    try {
        const std::wstring text = WidenAnsi(std::string("\nOrvex1: ") + where + ": " + what + "\n");
        acutPrintf(L"%ls", text.c_str());
        acedAlert(text.c_str());
    } catch (...) {
        // Out of memory while reporting: nothing more can be said safely.
    }
}
