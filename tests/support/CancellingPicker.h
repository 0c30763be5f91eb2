// A picker platform that cancels at once and counts its runs, for tests that call the LISP function
// through the entry point.
#pragma once

#include "host/Orvex.h"

#include <string>

namespace testsupport {

struct CancellingPicker : PickerPlatform {
    int runs = 0;           // how many times the dialog was asked for
    PickerArguments handed; // what the last run was given

    std::string StartShellPath(const std::string&) override { return {}; }
    int RunDialog(const PickerArguments& arguments) override;
    CTessel3Doc* Document() override { return nullptr; }
    void DestroyDocument() override {}
    void FocusHostView() override {}
};

} // namespace testsupport
