// The library's one LISP function and the process-wide values it hands to the explorer.
#pragma once

#include "hostapi/arxhost.h"

#include <string>

// Bounds of the fixed text buffers. Arguments that do not fit are refused with a message.
enum : int {
    kCaptionChars = 128,
    kPathChars = 260,
};

extern char g_szAcceptCaption[kCaptionChars]; // "OK" until the first call
extern char g_szCancelCaption[kCaptionChars]; // "CANCEL" until the first call
extern char g_szStartShellPath[kPathChars];   // display-name path of the start folder, or empty
extern char g_szStartPath[kPathChars];        // the start path as given (file-system form), or empty

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
    // Runs the invisible modal dialog that hosts the explorer; 1 = picked, 2 = cancelled.
    virtual int RunDialog() = 0;
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
