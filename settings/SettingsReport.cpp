#include "settings/SettingsReport.h"

#include <cstdio>

namespace {

void ReportToStandardError(const char* text, bool) {
    std::fputs(text, stderr);
}

SettingsReporter g_reporter = nullptr;

} // namespace

SettingsReporter SetSettingsReporter(SettingsReporter reporter) {
    SettingsReporter previous = g_reporter;
    g_reporter = reporter;
    return previous;
}

void ReportSettingsProblem(const std::string& text, bool alert) noexcept {
    try {
        (g_reporter ? g_reporter : ReportToStandardError)(text.c_str(), alert);
    } catch (...) {
    }
}
