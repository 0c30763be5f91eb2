// The library's application object.
#pragma once

#include "frame/MdiMixin.h"
#include "host/OrvexWin.h"

#include "res/resource.h"

// Owns the picker's Windows platform, which runs its explorer; the entry point hands it to `Orvex`.
class CTesselArxApp : public CMdiMixin {
public:
    bool InitInstance() override;
    PickerPlatform& Picker() { return *m_picker; }

private:
    const std::unique_ptr<PickerPlatform> m_picker = MakeWindowsPickerPlatform(*this);
};

extern CTesselArxApp theApp;
