// The library's application object.
#pragma once

#include "frame/MdiMixin.h"

#include "res/resource.h"

class CTesselArxApp : public CMdiMixin {
public:
    bool InitInstance() override;
};

extern CTesselArxApp theApp;
