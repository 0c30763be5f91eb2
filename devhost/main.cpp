// devhost.exe: the development host. See devhost/README.md for the command line and the output.
#include "devhost/Options.h"
#include "devhost/Output.h"
#include "devhost/Session.h"

#include <windows.h>
#include <commctrl.h>
#include <shellapi.h>

#include <vector>

namespace {

std::vector<std::wstring> Arguments() {
    std::vector<std::wstring> args;
    int count = 0;
    wchar_t** list = CommandLineToArgvW(GetCommandLineW(), &count);
    if (!list)
        return args;
    for (int i = 1; i < count; ++i)
        args.emplace_back(list[i]);
    LocalFree(list);
    return args;
}

} // namespace

int main() {
    try {
        INITCOMMONCONTROLSEX controls{sizeof controls, ICC_WIN95_CLASSES | ICC_STANDARD_CLASSES};
        InitCommonControlsEx(&controls);

        devhost::Options options;
        std::wstring error;
        if (!devhost::ParseOptions(Arguments(), options, error)) {
            devhost::WriteError(error);
            devhost::WriteError(devhost::kUsage);
            return devhost::kExitUsage;
        }
        if (options.help) {
            devhost::WriteText(devhost::kUsage);
            return devhost::kExitOk;
        }
        return devhost::RunSession(options);
    } catch (const std::bad_alloc&) {
        devhost::WriteError(L"out of memory");
        return devhost::kExitHost;
    }
}
