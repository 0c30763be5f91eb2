#include "host/ModuleObject.h"

#include "hostapi/HostApi.h"

#include <windows.h>

#include <new>

extern "C" IMAGE_DOS_HEADER __ImageBase;

namespace {
OrvexModule* g_pModule = nullptr;
} // namespace

template <> void OrvexModule::deleteModule() {
    g_pModule = nullptr;
    this->~OdRxWin32Module();
    odrxFree(this);
}

template <> OdString OrvexModule::moduleName() const {
    wchar_t path[MAX_PATH] = L"";
    GetModuleFileNameW(static_cast<HMODULE>(m_hInstance), path, MAX_PATH);
    path[MAX_PATH - 1] = 0;
    return OdString(path);
}

template <> void OrvexModule::initApp() {
    onLoadArxApp(moduleName().c_str());
}

template <> void OrvexModule::uninitApp() {
    onUnloadArxApp(moduleName().c_str());
}

OdRxModule* ModuleObjectSingleton() {
    return g_pModule;
}

OdRxModule* CreateModuleObject() {
    if (g_pModule)
        return g_pModule;
    void* memory = odrxAlloc(sizeof(OrvexModule));
    if (!memory)
        throw std::bad_alloc();
    g_pModule = new (memory) OrvexModule(reinterpret_cast<HINSTANCE>(&__ImageBase));
    return g_pModule;
}
