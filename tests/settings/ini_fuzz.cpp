// Fuzzes the ini reader: any bytes are read, written back and read again; from the first write on the
// file must stay the same (the store read from it writes the very same bytes). A file the store does
// not hold whole (a line too long, lines a save would change) must not be written over at all.
#include "settings/IniFile.h"
#include "settings/SettingsReport.h"
#include "tests/support/FuzzScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <unistd.h>

namespace {

std::string g_fileName;

bool SameStore(const CIniFile& a, const CIniFile& b) {
    if (a.GetNumKeys() != b.GetNumKeys())
        return false;
    for (int k = 0; k < a.GetNumKeys(); ++k) {
        if (a.names[k] != b.names[k] || a.keys[k].names.GetSize() != b.keys[k].names.GetSize())
            return false;
        for (int j = 0; j < a.keys[k].names.GetSize(); ++j) {
            if (a.keys[k].names[j] != b.keys[k].names[j] || a.keys[k].values[j] != b.keys[k].values[j])
                return false;
        }
    }
    return true;
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    // Memory-backed when available: every input is written and read.
    g_fileName = testsupport::FuzzScratchFile("ini_fuzz");
    SetSettingsReporter([](const char*, bool) {}); // refused saves are expected, not news
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    testsupport::WriteScratchBytes(g_fileName, data, size);
    const std::string input(reinterpret_cast<const char*>(data), size);

    CIniFile first(g_fileName);
    if (!first.ReadFile()) {
        // Only a file over the limit is refused; it is never written over.
        if (size <= kMaxIniFileBytes || first.WriteFile() ||
            testsupport::ReadScratchBytes(g_fileName) != input)
            std::abort();
        return 0;
    }
    if (!first.WriteFile() && testsupport::ReadScratchBytes(g_fileName) != input)
        std::abort();
    const std::string written = testsupport::ReadScratchBytes(g_fileName);

    CIniFile second(g_fileName);
    if (!second.ReadFile())
        std::abort();
    if (!SameStore(first, second))
        std::abort();
    second.WriteFile();
    if (testsupport::ReadScratchBytes(g_fileName) != written)
        std::abort();
    return 0;
}
