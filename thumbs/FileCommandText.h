// What the user is told when a file command they asked for could not be done. Portable: no <windows.h>;
// the grid gathers the facts (which file is gone, whether the folder takes no changes, the system's error).
#pragma once

#include <string>

enum class FileCommand { Rename, Delete, Paste };

// Why a command failed, as far as can be told afterwards.
struct FileCommandFailure {
    std::string missing;   // the name of a file (or folder) the command needed that is no longer there
    bool readOnly = false; // the folder takes no changes
    int error = 0;         // the system's error, when nothing better is known
};

// "Cannot rename "a.dwg": a.dwg no longer exists." and the like. subject: the drawing's name for a
// rename, the one name or the count for a delete, the folder for a paste.
std::string FileCommandFailureText(FileCommand command, const std::string& subject,
                                   const FileCommandFailure& why);
