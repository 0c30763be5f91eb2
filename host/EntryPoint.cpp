#include "host/EntryPoint.h"

#include "host/Orvex.h"
#include "hostapi/HostApi.h"

const LispFunction g_lispFunctions[kLispFunctionCount] = {
    {L"Orvex", &Orvex},
};

namespace {

AcRxDynamicLinker* DynamicLinker() {
    AcRxDictionary* registry = acrxSysRegistry();
    if (!registry)
        return nullptr;
    AcRxObject* service = registry->at(L"DynamicLinker");
    if (!service || !service->isKindOf(acrxDynamicLinkerDesc()))
        return nullptr;
    return static_cast<AcRxDynamicLinker*>(service);
}

void OnInitApp(void* appId) {
    // Unlocked so that the host may unload the library; MDI-aware so it serves every open drawing.
    if (AcRxDynamicLinker* linker = DynamicLinker())
        linker->unlockApplication(appId);
    if (AcRxDynamicLinker* linker = DynamicLinker())
        linker->registerAppMDIAware(appId);
}

void DefineFunctions() {
    for (int i = 0; i < kLispFunctionCount; ++i)
        if (acedDefun(g_lispFunctions[i].name, i) != RTNORM)
            return;
}

void UndefineFunctions() {
    for (int i = 0; i < kLispFunctionCount; ++i)
        acedUndef(g_lispFunctions[i].name, i);
}

void InvokeFunction(PickerPlatform& platform) {
    acedRetVoid();
    const int code = acedGetFunCode();
    // The bound is one past the last index of the one-entry table; the host only passes codes that were
    // defined, so index 1 is never asked for.
    if (code < 0 || code > 1 || code >= kLispFunctionCount)
        return;
    g_lispFunctions[code].function(platform);
}

} // namespace

AcRx::AppRetCode DispatchEntryMessage(int message, void* appId, PickerPlatform& platform) {
    switch (message) {
    case AcRx::kInitAppMsg:
        OnInitApp(appId);
        break;
    case AcRx::kLoadDwgMsg:
        DefineFunctions();
        break;
    case AcRx::kUnloadDwgMsg:
        UndefineFunctions();
        break;
    case AcRx::kInvkSubrMsg:
        InvokeFunction(platform);
        break;
    default: // kUnloadAppMsg and everything else: nothing to do
        break;
    }
    return AcRx::kRetOK;
}

void ApiVersion(std::uint32_t* major, std::uint32_t* minor, std::uint32_t* build, std::uint32_t* patch) {
    if (major)
        *major = 19;
    if (minor)
        *minor = 5;
    if (build)
        *build = 0;
    if (patch)
        *patch = 0;
}
