// A second process for the Windows tests of the settings files (share-mode locks and racing saves are
// only seen between processes):
//   settings_helper hold FILE READY RELEASE TIMEOUT_MS   opens FILE without sharing, creates READY, and
//                                                        holds FILE until RELEASE exists or the time is up
//   settings_helper write FILE TAG COUNT                 saves the store tagged TAG over FILE COUNT times
// Exit status 0 on success, 2 for bad arguments, 3 when FILE could not be held or never saved.
#include "settings/IniFile.h"
#include "settings/SettingsReport.h"

#include "TaggedStore.h"

#include <windows.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

bool Exists(const char* fileName) {
    return ::GetFileAttributesA(fileName) != INVALID_FILE_ATTRIBUTES;
}

int Hold(const char* fileName, const char* ready, const char* release, DWORD timeoutMs) {
    HANDLE file = ::CreateFileA(fileName, GENERIC_READ | GENERIC_WRITE, 0, nullptr, OPEN_EXISTING,
                                FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE) {
        std::printf("settings_helper: cannot hold %s (error %lu)\n", fileName, ::GetLastError());
        return 3;
    }
    HANDLE signal =
        ::CreateFileA(ready, GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (signal != INVALID_HANDLE_VALUE)
        ::CloseHandle(signal);
    std::printf("held %s\n", fileName);
    std::fflush(stdout);
    const DWORD start = ::GetTickCount();
    while (!Exists(release) && ::GetTickCount() - start < timeoutMs)
        ::Sleep(20);
    ::CloseHandle(file);
    return 0;
}

int Write(const char* fileName, const char* tag, int count) {
    SetSettingsReporter([](const char*, bool) {}); // failures are counted, not printed
    CIniFile ini(fileName);
    FillTaggedStore(ini, tag);
    int saved = 0;
    for (int i = 0; i < count; ++i)
        saved += ini.WriteFile() ? 1 : 0;
    std::printf("saved %d of %d\n", saved, count);
    return saved > 0 ? 0 : 3;
}

} // namespace

int main(int argc, char** argv) {
    if (argc == 6 && std::strcmp(argv[1], "hold") == 0)
        return Hold(argv[2], argv[3], argv[4], static_cast<DWORD>(std::strtoul(argv[5], nullptr, 10)));
    if (argc == 5 && std::strcmp(argv[1], "write") == 0)
        return Write(argv[2], argv[3], std::atoi(argv[4]));
    std::fprintf(stderr,
                 "usage: settings_helper hold FILE READY RELEASE TIMEOUT_MS | write FILE TAG COUNT\n");
    return 2;
}
