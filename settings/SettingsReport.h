// How the settings tell the user about a settings file they could not read or save. The settings sit
// below the module's host code, so the module installs the reporter at start-up (the host's command
// line and alert box); until then, and in programs that set none, messages go to the standard error.
// Portable: no <windows.h>.
#pragma once

#include <string>

// text begins and ends with a line feed, as the host's command line expects; alert asks for the host's
// alert box as well, for what a person has to act on.
using SettingsReporter = void (*)(const char* text, bool alert);

// Installs the reporter (nullptr: the standard error again) and returns the previous one.
SettingsReporter SetSettingsReporter(SettingsReporter reporter);

// Hands one message to the reporter. Never throws: a reporter that fails has nowhere else to go.
void ReportSettingsProblem(const std::string& text, bool alert = false) noexcept;
