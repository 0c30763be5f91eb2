// The file a fuzz target writes each input to: in memory-backed /dev/shm when there is one, else in /tmp;
// removed when the process ends; and the writing and reading of its bytes. POSIX only (the fuzz targets are
// built natively).
#pragma once

#include "tests/support/FileBytes.h"

#include <unistd.h>

#include <cstddef>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace testsupport {

// Creates "DIR/STEM_XXXXXX" + suffix and returns its path; aborts when neither place takes a file.
inline std::string FuzzScratchFile(const std::string& stem, const std::string& suffix = std::string()) {
    static std::string made; // one a process: each target asks once
    for (const char* dir : {"/dev/shm/", "/tmp/"}) {
        std::string pattern = dir + stem + "_XXXXXX" + suffix;
        const int fd = ::mkstemps(pattern.data(), static_cast<int>(suffix.size()));
        if (fd < 0)
            continue;
        ::close(fd);
        made = pattern;
        std::atexit([] { std::remove(made.c_str()); });
        return made;
    }
    std::abort();
}

// Writes size bytes at data to the file, replacing what it held; aborts when it cannot.
inline void WriteScratchBytes(const std::string& fileName, const void* data, std::size_t size) {
    std::FILE* file = std::fopen(fileName.c_str(), "wb");
    if (!file)
        std::abort();
    if (size != 0 && std::fwrite(data, 1, size, file) != size)
        std::abort();
    std::fclose(file);
}

// The file's bytes; aborts when it cannot be opened.
inline std::string ReadScratchBytes(const std::string& fileName) {
    std::string bytes;
    if (!ReadFileBytes(fileName, bytes))
        std::abort();
    return bytes;
}

} // namespace testsupport
