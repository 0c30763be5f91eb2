// The library's application object and module handle.
#pragma once

#include "frame/MdiMixin.h"

// The library's instance handle, found by its file name when the application object starts.
extern HINSTANCE g_hOrvexModule;

#include "res/resource.h"

class CTesselArxApp : public CMdiMixin {
public:
    bool InitInstance() override;
};

extern CTesselArxApp theApp;
