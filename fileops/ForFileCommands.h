// The file commands of the explorer: the clipboard's file list (copy, cut, paste, and whether Paste is
// offered), deleting the selected drawings to the Recycle Bin, renaming through the shell, copying one
// drawing to a file of the user's choice and the shell's property sheet.
//
// The clipboard holds one format, CF_HDROP, in a plain global block (no data object of the library), so
// nothing of the library stays on the clipboard once it is unloaded. A cut is the same list; the paste
// that follows it while the clipboard is unchanged moves the files instead of copying them.
//
// Every command is synchronous and runs the shell's own loops (confirmations, progress): a window of the
// grid may be gone when it returns, so callers look their controls up again afterwards.
#pragma once

#include <windows.h>

#include <string>
#include <vector>

class CEdit;

class ForFileCommands {
public:
    // True when the clipboard's file list names at least one drawing (".dwg", case ignored).
    bool ClipboardHoldsDrawings() const;
    // Pastes the clipboard's files into folder (copy, or move after a cut); true when the shell did it.
    // A list without a drawing pastes nothing.
    bool PasteInto(const std::string& folder, HWND owner) const;
    // Renames source to destination (full paths) with the shell; a non-zero result (the shell's) puts the
    // old name back into the label editor, when there is one.
    int RenameFile(const std::string& source, const std::string& destination, CEdit* label) const;
    // Copies source to a file chosen in a save dialog; asks before overwriting. Returns 1.
    int CopyToFile(const std::string& source, HWND owner) const;
};

// The clipboard's file list as the explorer reads it (empty when there is none).
std::vector<std::string> ClipboardFileList();
// Puts these full paths on the clipboard as the explorer's file list; cut marks them to be moved by the
// next paste. False when the clipboard could not be opened.
bool PutFileListOnClipboard(const std::vector<std::string>& paths, bool cut);

// Deletes the files (full paths) to the Recycle Bin (the shell confirms); the shell's result, or a
// non-zero value for an empty list.
int DeleteFiles(HWND owner, const std::vector<std::string>& paths);
// Opens the shell's property sheet of the file at path.
bool ShowFileProperties(const std::string& path);

// The texts of Copy to file.
extern const char* const kCopyFileTitle;
extern const char* const kOverwriteQuestion;
extern const char* const kOverwriteCaption;
extern const char* const kCannotCopy;
