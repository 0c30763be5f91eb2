// The library's one LISP function, what it hands to the explorer, and the platform that runs it.
#pragma once

#include "hostapi/arxhost.h"

#include <string>

// Bounds of the texts a call may hand on, in characters with the terminating null (a path as the ANSI file
// functions take it). Arguments that do not fit are refused with a message.
enum : int {
    kCaptionChars = 128,
    kPathChars = 260,
};

// What one call hands to the platform's run, taken from its arguments once they passed every check. Each
// text is narrow and shorter than its bound.
struct PickerArguments {
    std::string acceptCaption;  // the accept argument, or "Ok" when it is empty
    std::string cancelCaption;  // the cancel argument, or "Cancel" when it is empty
    std::string startPath;      // the start path made whole (file-system form), or empty
    std::string startShellPath; // display-name path of the start folder, or empty
};

// What the picker needs from the platform: the shell, the run dialog and the explorer document.
// Its owner hands it to `Orvex`: in the library the application object owns the Windows one; unit tests
// hand in fakes.
class CTessel3Doc;
class DrawingFolder;
struct PickerPlatform {
    virtual ~PickerPlatform() = default;
    // The shell's display-name path of a file-system path (folder part only), or "" when it has none.
    virtual std::string StartShellPath(const std::string& fileSystemPath) = 0;
    // A start path relative to the host's current folder made whole; others are returned as they are.
    virtual std::string WholeStartPath(const std::string& fileSystemPath) { return fileSystemPath; }
    // Runs the invisible modal dialog that hosts the explorer with this call's arguments; 1 = picked,
    // 2 = cancelled.
    virtual int RunDialog(const PickerArguments& arguments) = 0;
    // The explorer document of this run (created while the dialog initialised), or nullptr.
    virtual CTessel3Doc* Document() = 0;
    // The folder model of this run, with the drawing chosen when the dialog ended, or nullptr.
    virtual const DrawingFolder* Folder() { return nullptr; }
    // Destroys the explorer document, which saves the explorer's settings.
    virtual void DestroyDocument() = 0;
    // Gives the keyboard focus back to the host's active drawing view.
    virtual void FocusHostView() = 0;
};

// `Orvex`: checks the five LISP arguments, runs the explorer on `platform` and sets the LISP result.
// Returns 1 after a completed run (picked or cancelled), 0 after an argument error.
int Orvex(PickerPlatform& platform);
