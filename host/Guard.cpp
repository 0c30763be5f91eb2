#include "host/Guard.h"

#include "host/HostApi.h"
#include "host/TextConv.h"

void ReportLibraryError(const char* where, const char* what) {
    try {
        const std::wstring text = WidenAnsi(std::string("\nOrvex1: ") + where + ": " + what + "\n");
        acutPrintf(L"%ls", text.c_str());
        acedAlert(text.c_str());
    } catch (...) {
        // Out of memory while reporting: nothing more can be said safely.
    }
}
