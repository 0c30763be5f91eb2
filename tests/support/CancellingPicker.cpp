#include "tests/support/CancellingPicker.h"

namespace testsupport {

int CancellingPicker::RunDialog() {
    ++runs;
    return 2; // cancelled
}

} // namespace testsupport
