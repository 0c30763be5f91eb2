// The label path of the folder tree that leads to a file-system path, for the LISP call's start folder.
#pragma once

#include <string>

// "Desktop\My Computer\<drive's display name>\dir\" (or "Desktop\<network>\dir\" without a drive), with
// every name as the shell shows it; the file name is dropped. Empty when the shell cannot be reached.
std::string StartShellPathOf(const std::string& fileSystemPath);
