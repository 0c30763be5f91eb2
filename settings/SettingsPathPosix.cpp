// Natively there is no extension module: the settings file lies in the current directory, named as if
// the module lay there.
#include "settings/SettingsPath.h"

#include <unistd.h>

#include <vector>

std::string ExplorerSettingsPath() {
    char szFileName[kSettingsFileNameSize] = "";
    GetSettingsFileName(szFileName);
    return szFileName;
}

void GetSettingsFileName(char* pszFileName) {
    std::string dir;
    std::vector<char> cwd(4096);
    if (::getcwd(cwd.data(), cwd.size()))
        dir = cwd.data();
    if (!dir.empty() && dir.back() != '/')
        dir += '/';
    FormSettingsFileName(dir + kSettingsModuleName, pszFileName);
}
