// Reading a whole file's bytes with the C library: shared by the test helpers (which report through gtest)
// and the fuzz targets (which do not link it). Portable.
#pragma once

#include <cstddef>
#include <cstdio>
#include <string>

namespace testsupport {

// The file's bytes into bytes; false when it cannot be opened.
inline bool ReadFileBytes(const std::string& fileName, std::string& bytes) {
    bytes.clear();
    std::FILE* file = std::fopen(fileName.c_str(), "rb");
    if (!file)
        return false;
    char buffer[4096];
    std::size_t n;
    while ((n = std::fread(buffer, 1, sizeof buffer, file)) > 0)
        bytes.append(buffer, n);
    std::fclose(file);
    return true;
}

} // namespace testsupport
