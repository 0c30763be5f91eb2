#include "host/ArxApp.h"

#include "host/DataManager.h"
#include "hostapi/Guard.h"
#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"
#include "settings/SettingsReport.h"

// Static initialisation order matters: the data manager registers with the host's document manager
// first, then the application object is built. Both live as long as the library.
AsdkDataManager<CDocData> g_dataManager;
CTesselArxApp theApp;

bool CTesselArxApp::InitInstance() {
    // An exception caught in a window procedure is shown the host's way: command line and alert box.
    AfxSetErrorReporter([](const char* text) { ReportLibraryError("explorer window", text); });
    // Settings files that cannot be read or saved are said on the host's command line (and alerted).
    SetSettingsReporter([](const char* text, bool alert) {
        const std::wstring wide = WidenAnsi(text);
        acutPrintf(L"%ls", wide.c_str());
        if (alert)
            acedAlert(wide.c_str());
    });
    return SetUp(IDR_MAINFRAME);
}
