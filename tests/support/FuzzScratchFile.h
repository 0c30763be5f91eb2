// The file a fuzz target writes each input to: in memory-backed /dev/shm when there is one, else in /tmp;
// removed when the process ends. POSIX only (the fuzz targets are built natively).
#pragma once

#include <unistd.h>

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

} // namespace testsupport
