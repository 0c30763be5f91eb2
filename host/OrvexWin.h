// The picker's platform on Windows: the shell's display names, the run dialog and the document. The
// application object owns it and the entry point hands it to `Orvex`.
#pragma once

#include "host/Orvex.h"

#include <memory>

class CMdiMixin;

// `app` creates the explorer in the run dialog; it outlives the platform.
std::unique_ptr<PickerPlatform> MakeWindowsPickerPlatform(CMdiMixin& app);
