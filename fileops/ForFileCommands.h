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

#include "fileops/DropBlock.h"

#include <functional>
#include <string>
#include <vector>

class CEdit;

// What a file operation returns when nothing was done on purpose (the user said no, nothing to do).
constexpr int kFileOpNotDone = -1;

class ForFileCommands {
public:
    // True when the clipboard's file list names at least one drawing (".dwg", case ignored), names the
    // code page cannot hold included.
    bool ClipboardHoldsDrawings() const;
    // Pastes the clipboard's files into folder (copy, or move after a cut): 0 when the shell did it,
    // kFileOpNotDone when there was nothing to paste or the user said no, else the shell's error. A list
    // without a drawing pastes nothing. Names the code page cannot hold (a wide list) are not pasted: the
    // user is told which (tellUser, else a message box over owner), and the rest is.
    int PasteInto(const std::string& folder, HWND owner) const;

    // How a paste tells the user what it refused; unset: a message box.
    std::function<void(const std::wstring& text)> tellUser;
    // Renames source to destination (full paths) with the shell; a non-zero result (the shell's) puts the
    // old name back into the label editor, when there is one.
    int RenameFile(const std::string& source, const std::string& destination, CEdit* label) const;
    // Copies source to a file chosen in a save dialog; asks before overwriting. Returns 1.
    int CopyToFile(const std::string& source, HWND owner) const;

private:
    void TellRefused(HWND owner, const std::vector<std::u16string>& unheld) const;
};

// The clipboard's file list as the explorer reads it (empty when there is none): ANSI lists as they are,
// wide ones turned into the code page, and apart the wide names it cannot hold exactly.
DropList ClipboardDropList();
// Its names in the code page.
std::vector<std::string> ClipboardFileList();
// The first line of what a paste says about the names it did not take.
std::string PasteRefusedMessage(std::size_t count);
// Puts these full paths on the clipboard as the explorer's file list; cut marks them to be moved by the
// next paste. False when the clipboard could not be opened.
bool PutFileListOnClipboard(const std::vector<std::string>& paths, bool cut);

// Deletes the files (full paths) to the Recycle Bin (the shell confirms): 0 when done, kFileOpNotDone for
// an empty list or when the user said no, else the shell's error.
int DeleteFiles(HWND owner, const std::vector<std::string>& paths);
// Opens the shell's property sheet of the file at path.
bool ShowFileProperties(const std::string& path);

// The texts of Copy to file.
extern const char* const kCopyFileTitle;
extern const char* const kOverwriteQuestion;
extern const char* const kOverwriteCaption;
extern const char* const kCannotCopy;
