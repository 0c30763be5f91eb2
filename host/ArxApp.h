// The library's application object and module handle.
#pragma once

#include "frame/MdiMixin.h"

// The library's instance handle, found by its file name when the application object starts.
extern HINSTANCE g_hOrvexModule;

constexpr UINT IDR_MAINFRAME = 128;

class CTesselArxApp : public CMdiMixin {
public:
    bool InitInstance() override;
};

extern CTesselArxApp theApp;
