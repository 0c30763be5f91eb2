#include "preview/ShowPreview.h"

#include "hostapi/HostApi.h"
#include "preview/DrawPreview.h"

bool ShowDwgPreview(HWND window, const wchar_t* fileName, std::uint32_t background) {
    if (Host().acdbDisplayPreviewFromDwg)
        return acdbDisplayPreviewFromDwg(fileName, window, &background);
    ReportMissingHostOperation("acdbDisplayPreviewFromDwg", "the library draws the previews itself");
    return DrawDwgPreviewInWindow(window, fileName, static_cast<COLORREF>(background));
}

void NoteHostPreviewOperation() {
    if (!Host().acdbDisplayPreviewFromDwg)
        ReportMissingHostOperation("acdbDisplayPreviewFromDwg", "the library draws the previews itself");
}
