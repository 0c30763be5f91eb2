#include "settings/SettingsPath.h"

#include <windows.h>

#include <vector>

namespace {

// The module's whole file name, however long: the length is checked after, not cut by the buffer.
std::string ModuleFileName(HMODULE hModule) {
    std::vector<char> buffer(kSettingsFileNameSize);
    for (;;) {
        const DWORD length = GetModuleFileNameA(hModule, buffer.data(), static_cast<DWORD>(buffer.size()));
        if (length == 0)
            return "";
        if (length < buffer.size() || buffer.size() >= 32768)
            return std::string(buffer.data(), length);
        buffer.resize(buffer.size() * 2);
    }
}

} // namespace

void GetSettingsFileName(char* pszFileName) {
    // When the module is loaded under another name the handle is null and the host's own executable
    // names the file instead; that is how it has always behaved.
    FormSettingsFileName(ModuleFileName(GetModuleHandleA(kSettingsModuleName)), pszFileName);
}

std::string ExplorerSettingsPath() {
    char szFileName[kSettingsFileNameSize] = "";
    GetSettingsFileName(szFileName);
    return szFileName;
}
