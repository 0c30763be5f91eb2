// One run of devhost: the host's windows, the library's life cycle, the LISP calls and the script.
#pragma once

#include "devhost/Options.h"

namespace devhost {

// Exit codes.
enum ExitCode : int {
    kExitOk = 0,
    kExitLispError = 1, // a call could not be made (bad LISP text, unknown function)
    kExitUsage = 2,     // bad command line or script file
    kExitLoad = 3,      // the library could not be loaded or lacks an entry point
    kExitScript = 4,    // the script failed (a window did not come, input was refused, ...)
    kExitHost = 5,      // devhost could not create its own windows
};

int RunSession(const Options& options);

} // namespace devhost
