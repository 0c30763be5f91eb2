// --file-latency MS and --file-hang NAME: a drawing library on a slow or stopped file server. Every read
// of a drawing file (*.dwg) in the process, the library's and devhost's own preview operation's, waits MS
// milliseconds first, on the thread that reads; a read of the file NAME (its last path component, case
// ignored) waits until the process ends. Done through the modules' import tables (the C runtime's file
// functions and the system's): the library is not changed and exports nothing for it. The same watch
// counts the drawing files opened, for --timing's "opened" lines.
#pragma once

#include <windows.h>

namespace devhost {

// Slows the drawing file reads of module (the library, or devhost.exe itself) as the options say, and
// with --timing counts the drawing files it opens; nothing when none of those options is given.
void FileDelayWatch(HMODULE module);

// How many drawing files the watched modules have opened since the process began, on any thread.
long DrawingFilesOpened();

// --scan-latency MS: every entry of a folder search the library makes (the first and each next one, the
// system's wide and narrow searches and the runtime's) waits MS milliseconds first, on the thread that
// searches, as a folder listed over a slow network. Nothing when the option is not given. Called after
// the --timing watch, whose functions it calls through to.
void ScanDelayWatch(HMODULE library);

} // namespace devhost
