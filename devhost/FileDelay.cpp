#include "devhost/FileDelay.h"

#include "devhost/HostObjects.h"
#include "devhost/ImportPatch.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <cwchar>
#include <map>
#include <string>

namespace devhost {
namespace {

using WfopenFn = FILE*(__cdecl*)(const wchar_t*, const wchar_t*);
using FopenFn = FILE*(__cdecl*)(const char*, const char*);
using FreadFn = std::size_t(__cdecl*)(void*, std::size_t, std::size_t, FILE*);
using FcloseFn = int(__cdecl*)(FILE*);
using CreateFileWFn = HANDLE(WINAPI*)(LPCWSTR, DWORD, DWORD, LPSECURITY_ATTRIBUTES, DWORD, DWORD, HANDLE);
using ReadFileFn = BOOL(WINAPI*)(HANDLE, LPVOID, DWORD, LPDWORD, LPOVERLAPPED);
using CloseHandleFn = BOOL(WINAPI*)(HANDLE);

// The system's functions; the library's settings reads (CreateFileA) are left to --timing's watcher.
struct Originals {
    WfopenFn wfopen = nullptr;
    FopenFn fopen = nullptr;
    FreadFn fread = nullptr;
    FcloseFn fclose = nullptr;
    CreateFileWFn createFileW = nullptr;
    ReadFileFn readFile = nullptr;
    CloseHandleFn closeHandle = nullptr;
};
Originals g_system;

// The drawing files open now: the key is the FILE* or the HANDLE, the value whether reads of it hang.
SRWLOCK g_lock = SRWLOCK_INIT;
std::map<const void*, bool> g_open;
volatile LONG g_drawingsOpened = 0;

bool EndsWithDwg(const std::wstring& name) {
    return name.size() >= 4 &&
           CompareStringOrdinal(name.c_str() + name.size() - 4, 4, L".dwg", 4, TRUE) == CSTR_EQUAL;
}

std::wstring LastComponent(const std::wstring& path) {
    const std::size_t slash = path.find_last_of(L"\\/");
    return slash == std::wstring::npos ? path : path.substr(slash + 1);
}

std::wstring WidenAnsiPath(const char* name) {
    if (!name)
        return std::wstring();
    const int length = MultiByteToWideChar(CP_ACP, 0, name, -1, nullptr, 0);
    if (length <= 0)
        return std::wstring();
    std::wstring wide(static_cast<std::size_t>(length), L'\0');
    MultiByteToWideChar(CP_ACP, 0, name, -1, &wide[0], length);
    wide.resize(static_cast<std::size_t>(length - 1));
    return wide;
}

void Opened(const void* key, const std::wstring& path) {
    if (!key || !EndsWithDwg(path))
        return;
    InterlockedIncrement(&g_drawingsOpened);
    const std::wstring& hang = Host().options.fileHang;
    const std::wstring name = LastComponent(path);
    const bool hangs =
        !hang.empty() && CompareStringOrdinal(name.c_str(), static_cast<int>(name.size()), hang.c_str(),
                                              static_cast<int>(hang.size()), TRUE) == CSTR_EQUAL;
    AcquireSRWLockExclusive(&g_lock);
    try {
        g_open[key] = hangs;
    } catch (...) {
    }
    ReleaseSRWLockExclusive(&g_lock);
}

void Closed(const void* key) {
    AcquireSRWLockExclusive(&g_lock);
    g_open.erase(key);
    ReleaseSRWLockExclusive(&g_lock);
}

// The wait of one read of an open file: none for a file that is not a drawing.
void BeforeRead(const void* key) {
    AcquireSRWLockShared(&g_lock);
    const auto found = g_open.find(key);
    const bool drawing = found != g_open.end();
    const bool hangs = drawing && found->second;
    ReleaseSRWLockShared(&g_lock);
    if (hangs)
        Sleep(INFINITE); // a share that stopped answering: the process ends around this thread
    if (drawing && Host().options.fileLatencyMs > 0)
        Sleep(static_cast<DWORD>(Host().options.fileLatencyMs));
}

FILE* __cdecl DelayedWfopen(const wchar_t* name, const wchar_t* mode) {
    FILE* file = g_system.wfopen(name, mode);
    if (file && name)
        Opened(file, name);
    return file;
}

FILE* __cdecl DelayedFopen(const char* name, const char* mode) {
    FILE* file = g_system.fopen(name, mode);
    if (file && name)
        Opened(file, WidenAnsiPath(name));
    return file;
}

std::size_t __cdecl DelayedFread(void* buffer, std::size_t size, std::size_t count, FILE* file) {
    BeforeRead(file);
    return g_system.fread(buffer, size, count, file);
}

int __cdecl DelayedFclose(FILE* file) {
    Closed(file);
    return g_system.fclose(file);
}

HANDLE WINAPI DelayedCreateFileW(LPCWSTR name, DWORD access, DWORD share, LPSECURITY_ATTRIBUTES security,
                                 DWORD disposition, DWORD flags, HANDLE templateFile) {
    HANDLE file = g_system.createFileW(name, access, share, security, disposition, flags, templateFile);
    if (file != INVALID_HANDLE_VALUE && name)
        Opened(file, name);
    return file;
}

BOOL WINAPI DelayedReadFile(HANDLE file, LPVOID buffer, DWORD size, LPDWORD read, LPOVERLAPPED overlapped) {
    BeforeRead(file);
    return g_system.readFile(file, buffer, size, read, overlapped);
}

BOOL WINAPI DelayedCloseHandle(HANDLE handle) {
    Closed(handle);
    return g_system.closeHandle(handle);
}

// The system's functions themselves, so that every patched module calls through to them whatever its
// import table held before.
void FindSystemFunctions() {
    if (g_system.fread)
        return;
    HMODULE runtime = GetModuleHandleW(L"msvcrt.dll");
    HMODULE kernel = GetModuleHandleW(L"kernel32.dll");
    g_system.wfopen = reinterpret_cast<WfopenFn>(reinterpret_cast<void*>(GetProcAddress(runtime, "_wfopen")));
    g_system.fopen = reinterpret_cast<FopenFn>(reinterpret_cast<void*>(GetProcAddress(runtime, "fopen")));
    g_system.fclose = reinterpret_cast<FcloseFn>(reinterpret_cast<void*>(GetProcAddress(runtime, "fclose")));
    g_system.createFileW =
        reinterpret_cast<CreateFileWFn>(reinterpret_cast<void*>(GetProcAddress(kernel, "CreateFileW")));
    g_system.readFile =
        reinterpret_cast<ReadFileFn>(reinterpret_cast<void*>(GetProcAddress(kernel, "ReadFile")));
    g_system.closeHandle =
        reinterpret_cast<CloseHandleFn>(reinterpret_cast<void*>(GetProcAddress(kernel, "CloseHandle")));
    g_system.fread = reinterpret_cast<FreadFn>(reinterpret_cast<void*>(GetProcAddress(runtime, "fread")));
}

// The functions the library's import table held before (the system's, or --timing's watchers).
using FindFirstExWFn = HANDLE(WINAPI*)(LPCWSTR, FINDEX_INFO_LEVELS, LPVOID, FINDEX_SEARCH_OPS, LPVOID, DWORD);
using FindFirstWFn = HANDLE(WINAPI*)(LPCWSTR, LPWIN32_FIND_DATAW);
using FindFirstAFn = HANDLE(WINAPI*)(LPCSTR, LPWIN32_FIND_DATAA);
using FindNextWFn = BOOL(WINAPI*)(HANDLE, LPWIN32_FIND_DATAW);
using FindNextAFn = BOOL(WINAPI*)(HANDLE, LPWIN32_FIND_DATAA);
using RuntimeFindFirstFn = std::intptr_t(__cdecl*)(const char*, void*);
using RuntimeFindNextFn = int(__cdecl*)(std::intptr_t, void*);

struct ScanOriginals {
    FindFirstExWFn findFirstExW = nullptr;
    FindFirstWFn findFirstW = nullptr;
    FindFirstAFn findFirstA = nullptr;
    FindNextWFn findNextW = nullptr;
    FindNextAFn findNextA = nullptr;
    RuntimeFindFirstFn runtimeFindFirst = nullptr;
    RuntimeFindNextFn runtimeFindNext = nullptr;
};
ScanOriginals g_scan;

void ScanWait() {
    Sleep(static_cast<DWORD>(Host().options.scanLatencyMs));
}

HANDLE WINAPI SlowFindFirstFileExW(LPCWSTR pattern, FINDEX_INFO_LEVELS level, LPVOID found,
                                   FINDEX_SEARCH_OPS search, LPVOID filter, DWORD flags) {
    ScanWait();
    return g_scan.findFirstExW(pattern, level, found, search, filter, flags);
}

HANDLE WINAPI SlowFindFirstFileW(LPCWSTR pattern, LPWIN32_FIND_DATAW found) {
    ScanWait();
    return g_scan.findFirstW(pattern, found);
}

HANDLE WINAPI SlowFindFirstFileA(LPCSTR pattern, LPWIN32_FIND_DATAA found) {
    ScanWait();
    return g_scan.findFirstA(pattern, found);
}

BOOL WINAPI SlowFindNextFileW(HANDLE search, LPWIN32_FIND_DATAW found) {
    ScanWait();
    return g_scan.findNextW(search, found);
}

BOOL WINAPI SlowFindNextFileA(HANDLE search, LPWIN32_FIND_DATAA found) {
    ScanWait();
    return g_scan.findNextA(search, found);
}

std::intptr_t __cdecl SlowRuntimeFindFirst(const char* pattern, void* found) {
    ScanWait();
    return g_scan.runtimeFindFirst(pattern, found);
}

int __cdecl SlowRuntimeFindNext(std::intptr_t search, void* found) {
    ScanWait();
    return g_scan.runtimeFindNext(search, found);
}

} // namespace

long DrawingFilesOpened() {
    return InterlockedCompareExchange(&g_drawingsOpened, 0, 0);
}

void ScanDelayWatch(HMODULE library) {
    if (!library || Host().options.scanLatencyMs <= 0)
        return;
    Watch(library, "FindFirstFileExW", &SlowFindFirstFileExW, g_scan.findFirstExW);
    Watch(library, "FindFirstFileW", &SlowFindFirstFileW, g_scan.findFirstW);
    Watch(library, "FindFirstFileA", &SlowFindFirstFileA, g_scan.findFirstA);
    Watch(library, "FindNextFileW", &SlowFindNextFileW, g_scan.findNextW);
    Watch(library, "FindNextFileA", &SlowFindNextFileA, g_scan.findNextA);
    // The runtime's search, under whichever of its names the build imports.
    if (!Watch(library, "_findfirst64", &SlowRuntimeFindFirst, g_scan.runtimeFindFirst))
        Watch(library, "_findfirst64i32", &SlowRuntimeFindFirst, g_scan.runtimeFindFirst);
    if (!Watch(library, "_findnext64", &SlowRuntimeFindNext, g_scan.runtimeFindNext))
        Watch(library, "_findnext64i32", &SlowRuntimeFindNext, g_scan.runtimeFindNext);
}

void FileDelayWatch(HMODULE module) {
    const Options& options = Host().options;
    if (!module || (options.fileLatencyMs <= 0 && options.fileHang.empty() && !options.timing))
        return;
    FindSystemFunctions();
    if (!g_system.fread || !g_system.wfopen || !g_system.fopen || !g_system.fclose || !g_system.readFile ||
        !g_system.createFileW || !g_system.closeHandle)
        return;
    PatchImport(module, "_wfopen", reinterpret_cast<void*>(&DelayedWfopen));
    PatchImport(module, "fopen", reinterpret_cast<void*>(&DelayedFopen));
    PatchImport(module, "fread", reinterpret_cast<void*>(&DelayedFread));
    PatchImport(module, "fclose", reinterpret_cast<void*>(&DelayedFclose));
    PatchImport(module, "CreateFileW", reinterpret_cast<void*>(&DelayedCreateFileW));
    PatchImport(module, "ReadFile", reinterpret_cast<void*>(&DelayedReadFile));
    PatchImport(module, "CloseHandle", reinterpret_cast<void*>(&DelayedCloseHandle));
}

} // namespace devhost
