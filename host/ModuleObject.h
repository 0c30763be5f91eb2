// The module object the host's runtime asks for with odrxCreateModuleObject. One per process.
#pragma once

#include "hostapi/arxhost.h"

#include <atomic>

class CDrxModule : public OdRxModule {
protected:
    std::atomic<long> m_nRefCount{0};
    void* m_hInstance = nullptr;
};

template <class TBase, class TModule> class OdRxWin32Module : public TBase {
public:
    explicit OdRxWin32Module(void* instance) { this->m_hInstance = instance; }

    void addRef() override { ++this->m_nRefCount; }
    void release() override { --this->m_nRefCount; } // the host ends the object with deleteModule
    long numRefs() const override { return this->m_nRefCount.load(); }
    void* sysData() override { return this->m_hInstance; }
    void deleteModule() override;
    OdString moduleName() const override;
    void initApp() override;
    void uninitApp() override;
};

using OrvexModule = OdRxWin32Module<CDrxModule, CDrxModule>;

// The singleton, created on first request; throws std::bad_alloc when the host cannot allocate it.
OdRxModule* CreateModuleObject();
OdRxModule* ModuleObjectSingleton();
