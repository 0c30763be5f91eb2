// The library's last line of defence: no exception may reach the host, which holds the user's drawings.
#pragma once

#include <exception>

// Reports an error that reached a boundary of the library: one line on the host's command line and the
// host's alert box.
void ReportLibraryError(const char* where, const char* what);

// Runs `body`; an exception it throws is reported as an error of `where` and swallowed.
template <class F> bool GuardedCall(const char* where, F&& body) noexcept {
    try {
        body();
        return true;
    } catch (const std::exception& e) {
        ReportLibraryError(where, e.what());
    } catch (...) {
        ReportLibraryError(where, "unknown exception");
    }
    return false;
}
