// Fuzzes the preview reader the way the library reaches it: the input is written to a drawing file and
// read through ReadDwgPreview, which opens the file, seeks to the image section and reads only the parts
// it needs. Whatever the bytes, the file reader and the reader of the whole file in memory must agree.
#include "preview/DwgPreview.h"
#include "tests/support/FuzzScratchFile.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <unistd.h>

namespace {

std::string g_fileName;

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    // Memory-backed when available: every input is written and read.
    g_fileName = testsupport::FuzzScratchFile("preview_file_fuzz", ".dwg");
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    testsupport::WriteScratchBytes(g_fileName, data, size);
    DwgPreview fromFile;
    const bool read = ReadDwgPreview(g_fileName, fromFile);
    DwgPreview fromMemory;
    const bool parsed = ParseDwgPreview(data, size, fromMemory);
    if (read != parsed)
        std::abort();
    if (!read)
        return 0;
    if (fromFile.kind != fromMemory.kind || fromFile.bytes != fromMemory.bytes ||
        fromFile.width != fromMemory.width || fromFile.height != fromMemory.height)
        std::abort();
    // The picture is part of the file, no larger than a preview may be.
    if (fromFile.bytes.empty() || fromFile.bytes.size() > size || fromFile.bytes.size() > kMaxPictureBytes)
        std::abort();
    return 0;
}
