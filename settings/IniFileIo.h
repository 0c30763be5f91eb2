// The ini store's file access, one implementation per platform (IniFileIoWin.cpp, IniFileIoPosix.cpp).
// Files are read whole and replaced whole, never written in place: a crash, a full disk or a second
// program saving at the same moment leaves either the old file or the new one, never a cut or a mix.
#pragma once

#include <cstddef>
#include <string>

enum class WholeFileRead {
    Read,       // bytes holds the file
    Missing,    // there is no file of that name
    CannotOpen, // it exists but cannot be opened (in use without sharing, no permission, a folder)
    TooLarge,   // more than the limit: refused without reading it
    Failed,     // opened, but reading it failed
};

// Reads the file into bytes when it holds at most maxBytes. Opened shared for reading, writing and
// deleting, so a reader never stops a writer; only regular files are read (a pipe would block).
// fileSize, when given, receives the size of a file refused as TooLarge.
WholeFileRead ReadWholeFile(const std::string& fileName, std::size_t maxBytes, std::string& bytes,
                            unsigned long long* fileSize = nullptr);

// Writes bytes to a temporary file beside fileName and moves it over fileName. On failure returns
// false with the reason in a few words ("it is read-only", "the disk is full", ...): the file is as it
// was and the temporary file is gone. A read-only file or a folder in the file's place is refused
// before anything is written.
bool ReplaceWholeFile(const std::string& fileName, const std::string& bytes, std::string& reason);

// Tests: every replacement from now on finds room for only `bytes` more on the disk, and its write fails
// there as on a full disk (what fits is written first). A negative value: the disk's own room again.
void SetDiskRoomForTesting(long long bytes);

// The temporary file of one replacement: beside the file, unique per process and call.
std::string TemporaryFileBeside(const std::string& fileName, unsigned long processId,
                                unsigned long callNumber);
