// What one call of the LISP function hands to the explorer: copies, taken by the caller when the call
// begins and given to the frame when it is created. The frame keeps them for its lifetime.
#pragma once

#include <windows.h>

#include <string>

struct ExplorerCall {
    std::string acceptCaption = "OK";
    std::string cancelCaption = "CANCEL";
    std::string startPath;      // the start path as given (file-system form), or empty
    std::string startShellPath; // display-name path of the start folder, or empty
    HWND hostFrame = nullptr;   // the host's main frame, which takes no input while the explorer is open
};
