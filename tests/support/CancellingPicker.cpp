#include "tests/support/CancellingPicker.h"

namespace testsupport {

int CancellingPicker::RunDialog(const PickerArguments& arguments) {
    ++runs;
    handed = arguments;
    return 2; // cancelled
}

} // namespace testsupport
