// Natively there is no extension module: the settings file lies in the current directory.
#include "settings/SettingsPath.h"

#include <cstring>
#include <unistd.h>

namespace {

constexpr const char kSettingsFileBase[] = "Orvex1.ini";

} // namespace

std::string ExplorerSettingsPath() {
    std::string dir;
    char cwd[4096];
    if (::getcwd(cwd, sizeof cwd))
        dir = cwd;
    if (dir.empty())
        return kSettingsFileBase;
    if (dir.back() != '/')
        dir += '/';
    return dir + kSettingsFileBase;
}

void GetSettingsFileName(char* pszFileName) {
    std::string fileName = ExplorerSettingsPath();
    const std::size_t capacity = static_cast<std::size_t>(kSettingsFileNameSize) - 1;
    std::size_t length = fileName.size() < capacity ? fileName.size() : capacity;
    std::memcpy(pszFileName, fileName.data(), length);
    pszFileName[length] = '\0';
}
