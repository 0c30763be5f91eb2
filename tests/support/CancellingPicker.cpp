#include "tests/support/CancellingPicker.h"

namespace testsupport {

int CancellingPicker::RunDialog() {
    ++runs;
    return 2; // cancelled
}

} // namespace testsupport

// Native builds take the library's own cancelling platform from the host code; the Windows one is in
// Orvex1.arx, so the Windows test programs take this one.
#ifdef _WIN32
PickerPlatform& DefaultPickerPlatform() {
    static testsupport::CancellingPicker platform;
    return platform;
}
#endif
