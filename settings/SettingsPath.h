// Where the explorer keeps its settings: beside the extension module, under the module's name with the
// extension "ini" (C:\Tools\Orvex1.arx keeps them in C:\Tools\Orvex1.ini).
#pragma once

#include <string>

// Size of the buffer GetSettingsFileName fills, terminator included.
constexpr int kSettingsFileNameSize = 260;

// The module the settings belong to, looked up by this file name.
constexpr const char kSettingsModuleName[] = "Orvex1.arx";

// Forms the settings file name into pszFileName, which holds kSettingsFileNameSize characters. When
// the name would not fit (the module lies in too long a folder), or the module's name is unknown,
// pszFileName is left empty and the reason has been reported, on the command line and in an alert:
// the explorer then runs with its defaults and saves nothing.
void GetSettingsFileName(char* pszFileName);

// The settings file name as a string; empty when GetSettingsFileName refuses it.
std::string ExplorerSettingsPath();

// The settings file name of a module file (its folder and name, extension "ini") formed into
// pszFileName (kSettingsFileNameSize characters). Checks the length before copying anything: false,
// pszFileName empty and the reason reported when it does not fit or moduleFileName is empty.
bool FormSettingsFileName(const std::string& moduleFileName, char* pszFileName);
