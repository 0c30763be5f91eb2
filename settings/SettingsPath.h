// Where the explorer keeps its settings: beside the extension module, under the module's name with the
// extension "ini" (C:\Tools\Orvex1.arx keeps them in C:\Tools\Orvex1.ini).
#pragma once

#include <string>

// Size of the buffer GetSettingsFileName fills, terminator included.
constexpr int kSettingsFileNameSize = 260;

// The module the settings belong to, looked up by this file name.
constexpr const char kSettingsModuleName[] = "Orvex1.arx";

// Forms the settings file name into pszFileName, which holds kSettingsFileNameSize characters.
void GetSettingsFileName(char* pszFileName);

// The settings file name as a string.
std::string ExplorerSettingsPath();
