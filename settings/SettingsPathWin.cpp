#include "settings/SettingsPath.h"

#include <windows.h>

#include <stdlib.h>

void GetSettingsFileName(char* pszFileName) {
    // When the module is loaded under another name the handle is null and the host's own executable
    // names the file instead; that is how it has always behaved.
    HMODULE hModule = GetModuleHandleA(kSettingsModuleName);
    char szModule[kSettingsFileNameSize] = "";
    GetModuleFileNameA(hModule, szModule, kSettingsFileNameSize);
    szModule[kSettingsFileNameSize - 1] = '\0';

    char szDrive[_MAX_DRIVE];
    char szDir[_MAX_DIR];
    char szName[_MAX_FNAME];
    char szExt[_MAX_EXT];
    _splitpath(szModule, szDrive, szDir, szName, szExt);
    _makepath(pszFileName, szDrive, szDir, szName, "ini");
}

std::string ExplorerSettingsPath() {
    char szFileName[kSettingsFileNameSize] = "";
    GetSettingsFileName(szFileName);
    return szFileName;
}
