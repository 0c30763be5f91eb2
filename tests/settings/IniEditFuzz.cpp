// Fuzzes the ini store's edits: a file is read, changed with a run of set and delete operations on its
// values and sections (as the explorer and the folder settings dialog change them), written, and read back
// into a fresh store, which must hold exactly the sections that have values, in order, with the same values.
// A file the store did not take whole is never written over. Input: a file, then the operations.
#include "settings/IniFile.h"
#include "settings/SettingsReport.h"
#include "tests/support/FuzzScratchFile.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <unistd.h>
#include <utility>
#include <vector>

namespace {

std::string g_fileName;

// A section heading the format can carry: one line that reads back as the same name.
bool SectionFits(const std::string& name) {
    return name.find('\n') == std::string::npos &&
           (name.empty() || (name.front() != '[' && name.back() != ']')) &&
           name.size() + 2 <= static_cast<std::size_t>(kMaxIniLineChars);
}

// A name=value line that reads back as the same pair (and not as a heading).
bool ValueFits(const std::string& name, const std::string& value) {
    const std::string line = name + "=" + value;
    return name.find('=') == std::string::npos && line.find('\n') == std::string::npos &&
           !(line.front() == '[' && line.back() == ']') &&
           line.size() <= static_cast<std::size_t>(kMaxIniLineChars);
}

using Section = std::pair<std::string, std::vector<std::pair<std::string, std::string>>>;

// What a save keeps: the sections that have values, in order.
std::vector<Section> Saved(const CIniFile& ini) {
    std::vector<Section> out;
    for (int k = 0; k < ini.GetNumKeys(); ++k) {
        if (ini.keys[k].names.GetSize() == 0)
            continue;
        Section section{ini.names[k], {}};
        for (int j = 0; j < ini.keys[k].names.GetSize(); ++j)
            section.second.emplace_back(ini.keys[k].names[j], ini.keys[k].values[j]);
        out.push_back(std::move(section));
    }
    return out;
}

// A name from the store (so that deletes and replacements hit) or a new one.
std::string SectionName(FuzzedDataProvider& in, const CIniFile& ini) {
    if (ini.GetNumKeys() > 0 && in.ConsumeBool())
        return ini.names[in.ConsumeIntegralInRange<int>(0, ini.GetNumKeys() - 1)];
    return in.ConsumeRandomLengthString(16);
}

std::string ValueName(FuzzedDataProvider& in, const CIniFile& ini, const std::string& section) {
    const int k = ini.FindKey(section);
    if (k >= 0 && ini.keys[k].names.GetSize() > 0 && in.ConsumeBool())
        return ini.keys[k].names[in.ConsumeIntegralInRange<int>(0, ini.keys[k].names.GetSize() - 1)];
    return in.ConsumeRandomLengthString(16);
}

} // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    // Memory-backed when available: every input is written and read.
    g_fileName = testsupport::FuzzScratchFile("ini_edit_fuzz");
    SetSettingsReporter([](const char*, bool) {}); // refused saves are expected, not news
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzedDataProvider in(data, size);
    const std::string original = in.ConsumeRandomLengthString(4096);
    testsupport::WriteScratchBytes(g_fileName, original.data(), original.size());

    CIniFile ini(g_fileName);
    const bool read = ini.ReadFile();

    for (int op = 0; op < 64 && in.remaining_bytes() > 0; ++op) {
        const std::string section = SectionName(in, ini);
        switch (in.ConsumeIntegralInRange<int>(0, 4)) {
        case 0: { // set a text value
            const std::string name = ValueName(in, ini, section);
            const std::string value = in.ConsumeRandomLengthString(32);
            if (!SectionFits(section) || !ValueFits(name, value))
                break;
            if (!ini.SetValue(section, name, value) || ini.GetValue(section, name) != value)
                std::abort();
            break;
        }
        case 1: { // set a number
            const std::string name = ValueName(in, ini, section);
            const int value = in.ConsumeIntegral<int>();
            if (!SectionFits(section) || !ValueFits(name, std::to_string(value)))
                break;
            if (!ini.SetValueI(section, name, value) || ini.GetValueI(section, name) != value)
                std::abort();
            break;
        }
        case 2: { // replace a value only where it exists
            const std::string name = ValueName(in, ini, section);
            const std::string value = in.ConsumeRandomLengthString(32);
            if (!ValueFits(name, value))
                break;
            const int k = ini.FindKey(section);
            const bool existed = k >= 0 && ini.FindValue(k, name) >= 0;
            if (ini.SetValue(section, name, value, false) != existed ||
                (existed && ini.GetValue(section, name) != value) || (!existed && ini.FindKey(section) != k))
                std::abort();
            break;
        }
        case 3: { // delete a value
            const std::string name = ValueName(in, ini, section);
            const int k = ini.FindKey(section);
            const bool existed = k >= 0 && ini.FindValue(k, name) >= 0;
            const int before = existed ? ini.GetNumValues(section) : 0;
            if (ini.DeleteValue(section, name) != existed)
                std::abort();
            if (existed &&
                (ini.FindValue(ini.FindKey(section), name) != -1 || ini.GetNumValues(section) != before - 1))
                std::abort();
            break;
        }
        case 4: { // delete a section
            const bool existed = ini.FindKey(section) >= 0;
            const int before = ini.GetNumKeys();
            if (ini.DeleteKey(section) != existed || ini.FindKey(section) != -1 ||
                ini.GetNumKeys() != before - (existed ? 1 : 0))
                std::abort();
            break;
        }
        }
    }

    const bool written = ini.WriteFile();
    if (!written) {
        // Only a file the store did not hold whole is refused, and then it is left exactly as it was.
        if (testsupport::ReadScratchBytes(g_fileName) != original)
            std::abort();
        return 0;
    }
    (void)read;
    CIniFile back(g_fileName);
    if (!back.ReadFile() || Saved(back) != Saved(ini) ||
        back.GetNumKeys() != static_cast<int>(Saved(ini).size()))
        std::abort();
    // And that file is one the store writes back unchanged.
    const std::string bytes = testsupport::ReadScratchBytes(g_fileName);
    if (!back.WriteFile() || testsupport::ReadScratchBytes(g_fileName) != bytes)
        std::abort();
    return 0;
}
