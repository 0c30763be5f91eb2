// The library's whole export table (see Orvex1.def). Nothing thrown inside may leave these functions.
#include "host/ArxApp.h"
#include "host/EntryPoint.h"
#include "host/ModuleObject.h"
#include "hostapi/Guard.h"

#include "framework/afxwin.h"

extern "C" AcRx::AppRetCode acrxEntryPoint(AcRx::AppMsgCode message, void* appId) {
    GuardedCall("acrxEntryPoint", [&] {
        // A DLL has no WinMain: the application object starts with the first message that needs it.
        if (message == AcRx::kInitAppMsg || message == AcRx::kInvkSubrMsg)
            AfxWinInit();
        DispatchEntryMessage(message, appId, theApp.Picker());
        // The window classes go with the application, so the library can be loaded again later.
        if (message == AcRx::kUnloadAppMsg)
            AfxWinTerm();
    });
    return AcRx::kRetOK;
}

extern "C" int acrxGetApiVersion(std::uint32_t* major, std::uint32_t* minor, std::uint32_t* build,
                                 std::uint32_t* patch) {
    ApiVersion(major, minor, build, patch);
    return 0;
}

extern "C" int odrxGetAPIVersion(std::uint32_t* major, std::uint32_t* minor, std::uint32_t* build,
                                 std::uint32_t* patch) {
    ApiVersion(major, minor, build, patch);
    return 0;
}

extern "C" OdRxModule* odrxCreateModuleObject() {
    OdRxModule* module = nullptr;
    GuardedCall("odrxCreateModuleObject", [&] { module = CreateModuleObject(); });
    return module;
}
