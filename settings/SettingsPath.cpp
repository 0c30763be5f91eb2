#include "settings/SettingsPath.h"

#include "settings/SettingsReport.h"

#include "hostapi/NarrowText.h"

#include <cstring>

bool FormSettingsFileName(const std::string& moduleFileName, char* pszFileName) {
    pszFileName[0] = '\0';
    if (moduleFileName.empty()) {
        ReportSettingsProblem(
            "\nOrvex: the library's file name could not be found; the explorer uses its default "
            "settings and does not save them\n",
            true);
        return false;
    }
    // The extension is what follows the last dot of the file's own name (not of a folder's); as with
    // the platform's path splitting, a name without one simply gets ".ini".
    const std::string::size_type nameStart = LastCharacterOf(moduleFileName, "\\/:");
    std::string::size_type dot = moduleFileName.find_last_of('.');
    if (dot == std::string::npos || (nameStart != std::string::npos && dot < nameStart))
        dot = moduleFileName.size();
    const std::string fileName = moduleFileName.substr(0, dot) + ".ini";

    if (fileName.size() >= static_cast<std::size_t>(kSettingsFileNameSize)) {
        // The buffer holds bytes: a double-byte character takes two.
        const bool multiByte = CharacterCount(fileName) != fileName.size();
        ReportSettingsProblem(
            "\nOrvex: the library's folder is too long for its settings file (" +
                CharactersAndBytes(fileName) + ", at most " + std::to_string(kSettingsFileNameSize - 1) +
                (multiByte ? " bytes" : "") +
                "); the explorer uses its default settings and does not save them: " + fileName + "\n",
            true);
        return false;
    }
    std::memcpy(pszFileName, fileName.c_str(), fileName.size() + 1);
    return true;
}
