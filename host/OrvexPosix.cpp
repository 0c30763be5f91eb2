// Native builds have no shell and no windows: the picker's platform cancels at once.
#include "host/Orvex.h"

namespace {

struct NoWindowsPlatform : PickerPlatform {
    std::string StartShellPath(const std::string&) override { return {}; }
    int RunDialog() override { return 2; }
    CTessel3Doc* Document() override { return nullptr; }
    void DestroyDocument() override {}
    void FocusHostView() override {}
};

} // namespace

PickerPlatform& DefaultPickerPlatform() {
    static NoWindowsPlatform platform;
    return platform;
}
