#include "tests/support/ProcessResources.h"

#include <windows.h>

#include <tlhelp32.h>
#include <winternl.h>

#include <cstdint>

namespace testsupport {

namespace {

// One entry of the process's GDI handle table, as the system lays it out on 64-bit Windows (and Wine):
// an entry whose type is not 0 is an object in use.
struct GdiTableEntry {
    std::uint64_t object;
    std::uint32_t owner;
    std::uint16_t unique;
    std::uint8_t type;
    std::uint8_t flags;
    std::uint64_t user;
};
static_assert(sizeof(GdiTableEntry) == 24, "a GDI table entry is 24 bytes on 64-bit Windows");

constexpr std::size_t kGdiTableEntries = 0x10000;
constexpr std::size_t kPebGdiTableOffset = 0xF8; // GdiSharedHandleTable in the 64-bit process block

// The process block, asked of the system (reading it through the thread block trips the compiler's
// bounds check on the segment read).
const unsigned char* ProcessBlock() {
    using QueryFunction = LONG(WINAPI*)(HANDLE, PROCESSINFOCLASS, PVOID, ULONG, PULONG);
    HMODULE ntdll = GetModuleHandleW(L"ntdll.dll");
    auto query = ntdll ? reinterpret_cast<QueryFunction>(
                             reinterpret_cast<void*>(GetProcAddress(ntdll, "NtQueryInformationProcess")))
                       : nullptr;
    PROCESS_BASIC_INFORMATION basic{};
    if (query == nullptr ||
        query(GetCurrentProcess(), ProcessBasicInformation, &basic, sizeof basic, nullptr) != 0)
        return nullptr;
    return reinterpret_cast<const unsigned char*>(basic.PebBaseAddress);
}

} // namespace

// GetGuiResources answers 0 under Wine; the handle table the process block points to holds them all.
long CountGdiObjects() {
    const unsigned char* peb = ProcessBlock();
    if (peb == nullptr)
        return -1;
    const auto* table = *reinterpret_cast<const GdiTableEntry* const*>(peb + kPebGdiTableOffset);
    if (table == nullptr)
        return -1;
    const DWORD pid = GetCurrentProcessId();
    long count = 0;
    for (std::size_t i = 0; i < kGdiTableEntries; ++i) {
        if (table[i].type == 0)
            continue;
        // Windows keeps the owner's process id in the low word; Wine leaves it 0 in its own table.
        const std::uint16_t owner = static_cast<std::uint16_t>(table[i].owner & 0xFFFF);
        if (owner == 0 || owner == static_cast<std::uint16_t>(pid & 0xFFFF))
            ++count;
    }
    return count;
}

// GetProcessHandleCount answers 0 under Wine: each possible handle value is asked about instead.
long CountHandles() {
    long count = 0;
    for (std::uintptr_t value = 4; value < 0x20000; value += 4) {
        DWORD flags = 0;
        if (GetHandleInformation(reinterpret_cast<HANDLE>(value), &flags))
            ++count;
    }
    return count;
}

long CountThreads() {
    HANDLE snapshot = CreateToolhelp32Snapshot(TH32CS_SNAPTHREAD, 0);
    if (snapshot == INVALID_HANDLE_VALUE)
        return -1;
    THREADENTRY32 entry{};
    entry.dwSize = sizeof entry;
    long count = 0;
    for (BOOL more = Thread32First(snapshot, &entry); more; more = Thread32Next(snapshot, &entry))
        if (entry.th32OwnerProcessID == GetCurrentProcessId())
            ++count;
    CloseHandle(snapshot);
    return count;
}

namespace {

BOOL CALLBACK CountChild(HWND, LPARAM counter) {
    ++*reinterpret_cast<long*>(counter);
    return TRUE;
}

BOOL CALLBACK CountTopLevel(HWND window, LPARAM counter) {
    DWORD pid = 0;
    GetWindowThreadProcessId(window, &pid);
    if (pid != GetCurrentProcessId())
        return TRUE;
    ++*reinterpret_cast<long*>(counter);
    EnumChildWindows(window, &CountChild, counter);
    return TRUE;
}

long CountWindows() {
    long count = 0;
    EnumWindows(&CountTopLevel, reinterpret_cast<LPARAM>(&count));
    return count;
}

ProcessResources CountOnce() {
    ProcessResources resources;
    resources.gdiObjects = CountGdiObjects();
    resources.windows = CountWindows();
    resources.handles = CountHandles();
    resources.threads = CountThreads();
    return resources;
}

} // namespace

bool operator==(const ProcessResources& a, const ProcessResources& b) {
    return a.gdiObjects == b.gdiObjects && a.windows == b.windows && a.handles == b.handles &&
           a.threads == b.threads;
}

ProcessResources CountProcessResources() {
    // A thread that was ending as the call returned (the system's or the library's) still holds its
    // handles for a moment: the counts are taken again until two in a row agree, for a second at most.
    constexpr int kTries = 20;
    constexpr DWORD kPauseMs = 50;
    ProcessResources last = CountOnce();
    for (int i = 0; i < kTries; ++i) {
        Sleep(kPauseMs);
        const ProcessResources now = CountOnce();
        if (now == last)
            break;
        last = now;
    }
    return last;
}

} // namespace testsupport
