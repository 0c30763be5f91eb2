// Binds the host's operations by export name from the modules of the process that loaded the library.
// The executable is searched first, then every other module in load order, so a host that spreads its
// interface over several DLLs is found too. This runs during the library's static initialisation
// (under the loader lock), so it only calls GetModuleHandle, EnumProcessModules and GetProcAddress.
#include "hostapi/HostApi.h"

#include <windows.h>
#include <psapi.h>

#include <vector>

namespace {

std::vector<HMODULE> ProcessModules() {
    std::vector<HMODULE> modules;
    HMODULE exe = GetModuleHandleW(nullptr);
    if (exe)
        modules.push_back(exe);
    DWORD needed = 0;
    HANDLE process = GetCurrentProcess();
    std::vector<HMODULE> all(256);
    if (K32EnumProcessModules(process, all.data(), static_cast<DWORD>(all.size() * sizeof(HMODULE)),
                              &needed)) {
        if (needed > all.size() * sizeof(HMODULE)) {
            all.resize(needed / sizeof(HMODULE));
            if (!K32EnumProcessModules(process, all.data(), static_cast<DWORD>(all.size() * sizeof(HMODULE)),
                                       &needed))
                needed = 0;
        }
        all.resize(needed / sizeof(HMODULE));
        for (HMODULE m : all)
            if (m != exe)
                modules.push_back(m);
    }
    return modules;
}

FARPROC FindExport(const std::vector<HMODULE>& modules, const char* name) {
    for (HMODULE m : modules)
        if (FARPROC p = GetProcAddress(m, name))
            return p;
    return nullptr;
}

} // namespace

int BindHostApi(HostApi& api) {
    const std::vector<HMODULE> modules = ProcessModules();
    int found = 0;
#define ORVEX_HOST_BIND(ret, name, params)                                                                   \
    api.name = reinterpret_cast<ret(*) params>(reinterpret_cast<void*>(FindExport(modules, #name)));         \
    found += api.name != nullptr;
    ORVEX_HOST_OPERATIONS(ORVEX_HOST_BIND)
#undef ORVEX_HOST_BIND
    return found;
}

void WriteDebuggerLine(const char* text) {
    OutputDebugStringA(text);
}
