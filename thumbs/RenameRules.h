// What a new drawing name typed in a thumbnail's label must be before the file is renamed: a plain file
// name (no folder, no wildcard, no control character, no device name), a drawing (".dwg" at its end), one
// that no other file has, and short enough for the runtime's path buffers. Portable: no <windows.h>.
#pragma once

#include <functional>
#include <string>

enum class RenameVerdict {
    Rename,       // go ahead
    Unchanged,    // the very same name: nothing to do, nothing to say (a change of case alone is a rename)
    Empty,        // no name at all, or nothing before ".dwg"
    BadCharacter, // \ / : * ? " < > | or a control character
    DeviceName,   // CON, PRN, AUX, NUL, COM1-9, LPT1-9, with or without extension
    NotDrawing,   // does not end in ".dwg"
    TooLong,      // folder, "\" and name do not fit the path buffers
    Exists,       // another file of the folder has that name
};

// Judges newName for the file oldName of folder. exists tells whether a file of that name is already in
// the folder (the caller asks the file system); it is called only when every other rule holds.
RenameVerdict CheckRename(const std::string& folder, const std::string& oldName, const std::string& newName,
                          const std::function<bool(const std::string&)>& exists);

// What the user is told when the rename is refused; empty for Rename and Unchanged.
std::string RenameRefusalText(RenameVerdict verdict, const std::string& newName);
