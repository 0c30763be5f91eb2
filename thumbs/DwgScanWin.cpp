// The folder scan over the system's wide file search, its thread, and the pick's check of a name
// (Windows only).
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "thumbs/NameFold.h"

#include <cstdint>
#include <windows.h>

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace {

std::wstring Widened(const std::string& text) {
    const int n = ::MultiByteToWideChar(CP_ACP, 0, text.data(), static_cast<int>(text.size()), nullptr, 0);
    std::wstring wide(static_cast<std::size_t>(n), L'\0');
    if (n > 0)
        ::MultiByteToWideChar(CP_ACP, 0, text.data(), static_cast<int>(text.size()), wide.data(), n);
    return wide;
}

// The name as the runtime's narrow file search gives it: the code page's best fit, '?' for the rest.
std::string Narrowed(const wchar_t* wide) {
    const int n = ::WideCharToMultiByte(CP_ACP, 0, wide, -1, nullptr, 0, nullptr, nullptr);
    if (n <= 1)
        return {};
    std::string narrow(static_cast<std::size_t>(n), '\0');
    ::WideCharToMultiByte(CP_ACP, 0, wide, -1, narrow.data(), n, nullptr, nullptr);
    narrow.resize(static_cast<std::size_t>(n - 1));
    return narrow;
}

// Closes a wide file search however the look ends.
class WideFindHandle {
public:
    explicit WideFindHandle(HANDLE handle) : m_handle(handle) {}
    WideFindHandle(const WideFindHandle&) = delete;
    WideFindHandle& operator=(const WideFindHandle&) = delete;
    ~WideFindHandle() {
        if (m_handle != INVALID_HANDLE_VALUE)
            ::FindClose(m_handle);
    }
    HANDLE get() const { return m_handle; }

private:
    HANDLE m_handle;
};

// Whether the entry's attributes can be read by its name in the code page, as its preview would be opened.
bool IsReadableEntry(const std::string& folder, const wchar_t* name) {
    return ::GetFileAttributesA(DrawingFolder::Join(folder, Narrowed(name)).c_str()) !=
           INVALID_FILE_ATTRIBUTES;
}

} // namespace

std::string UnreadableFolderMessage(const std::string& folder, bool existsAsFile, unsigned long error) {
    const std::string start = "The folder cannot be read: " + folder;
    if (existsAsFile)
        return start + " is a file, not a folder";
    if (error == ERROR_FILE_NOT_FOUND || error == ERROR_PATH_NOT_FOUND || error == ERROR_INVALID_NAME)
        return start + " does not exist";
    if (error == ERROR_ACCESS_DENIED)
        return start + ": access is denied";
    return start + " cannot be reached";
}

PickedName CheckPickedName(const std::string& folder, const std::string& name) {
    if (folder.empty() || name.empty())
        return PickedName::Missing;
    const std::wstring pattern = Widened(DrawingFolder::Join(folder, "*"));
    WIN32_FIND_DATAW found;
    WideFindHandle search(::FindFirstFileW(pattern.c_str(), &found));
    if (search.get() == INVALID_HANDLE_VALUE)
        return PickedName::Missing;
    int listed = 0;
    bool inexact = false;
    do {
        if (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY)
            continue;
        std::string narrow = Narrowed(found.cFileName);
        // A name that does not come back from its narrow form is not the file's name.
        const bool exact = !narrow.empty() && Widened(narrow) == found.cFileName;
        FoldNameInPlace(narrow);
        if (narrow != name)
            continue;
        ++listed;
        if (!exact)
            inexact = true;
    } while (::FindNextFileW(search.get(), &found));
    if (inexact)
        return PickedName::NotInCodePage;
    if (listed > 1)
        return PickedName::Ambiguous;
    return listed == 1 ? PickedName::Exact : PickedName::Missing;
}

namespace {

// Seconds since 1970 from a file time, as the runtime's file search gives its write time.
std::int64_t SecondsSince1970(const FILETIME& time) {
    constexpr std::int64_t kTicksPerSecond = 10000000;
    constexpr std::int64_t kTicksTo1970 = 116444736000000000LL;
    const std::int64_t ticks = static_cast<std::int64_t>(
        (static_cast<std::uint64_t>(time.dwHighDateTime) << 32) | time.dwLowDateTime);
    return (ticks - kTicksTo1970) / kTicksPerSecond;
}

// The entry in the names' code page. A name that does not come back from its narrow form is kept as the
// narrow search gave it (the code page's best fit): it shows, and the pick says why it cannot be taken.
DwgFindEntry EntryOf(const WIN32_FIND_DATAW& found) {
    DwgFindEntry entry;
    entry.name = Narrowed(found.cFileName);
    entry.isDirectory = (found.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    entry.timeWrite = SecondsSince1970(found.ftLastWriteTime);
    // The 64-bit size: a 32-bit one turns a file of 2 GiB and more into a negative or wrong size.
    entry.size = (static_cast<std::uint64_t>(found.nFileSizeHigh) << 32) | found.nFileSizeLow;
    return entry;
}

// The wide search, without the short names and in large reads where the system offers them.
HANDLE FindFirst(const std::wstring& pattern, WIN32_FIND_DATAW& found) {
    HANDLE search = ::FindFirstFileExW(pattern.c_str(), FindExInfoBasic, &found, FindExSearchNameMatch,
                                       nullptr, FIND_FIRST_EX_LARGE_FETCH);
    if (search == INVALID_HANDLE_VALUE && ::GetLastError() == ERROR_INVALID_PARAMETER)
        search =
            ::FindFirstFileExW(pattern.c_str(), FindExInfoBasic, &found, FindExSearchNameMatch, nullptr, 0);
    return search;
}

// The scan as the thread of its own runs it; the module reference is given back as the thread ends.
struct ScanThreadStart {
    std::shared_ptr<FolderScan> scan;
    HMODULE module;
};

DWORD WINAPI ScanThread(void* parameter) {
    HMODULE module = nullptr;
    {
        const std::unique_ptr<ScanThreadStart> start(static_cast<ScanThreadStart*>(parameter));
        module = start->module;
        try {
            FileSystemFolderReader reader;
            RunFolderScan(reader, *start->scan);
        } catch (...) {
            // Nothing leaves a thread of the library.
        }
    } // the last holder of an abandoned scan frees it here, while the library is surely there
    FreeLibraryAndExitThread(module, 0);
}

} // namespace

bool FileSystemFolderReader::Read(const std::string& folder, std::vector<DwgData>& drawings,
                                  std::string& problem, ScanProgress& progress) {
    drawings.clear();
    problem.clear();
    if (folder.empty())
        return false;
    // Refused before the pattern is made: it may not be cut short.
    if (std::string refused = FolderPathProblem(folder); !refused.empty()) {
        problem = std::move(refused);
        return false;
    }
    const std::wstring pattern = Widened(DrawingFolder::Join(folder, "*"));
    WIN32_FIND_DATAW found;
    WideFindHandle search(FindFirst(pattern, found));
    if (search.get() == INVALID_HANDLE_VALUE) {
        const DWORD findError = ::GetLastError();
        const DWORD attributes = ::GetFileAttributesA(folder.c_str());
        const DWORD error = ::GetLastError();
        const bool isFolder =
            attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY);
        // A drive's root without a single entry lists nothing, not even "." and "..": read, and empty.
        if (isFolder && (findError == ERROR_FILE_NOT_FOUND || findError == ERROR_NO_MORE_FILES))
            return true;
        if (isFolder)
            problem = UnreadableFolderMessage(folder, false,
                                              findError == ERROR_ACCESS_DENIED ? ERROR_ACCESS_DENIED : 0);
        else
            problem = UnreadableFolderMessage(folder, attributes != INVALID_FILE_ATTRIBUTES, error);
        return false;
    }
    int tooLong = 0;
    do {
        // Left between two entries: a million files are not read to the end for nothing.
        if (progress.abandoned.load(std::memory_order_relaxed)) {
            drawings.clear();
            return false;
        }
        DwgFindEntry entry = EntryOf(found);
        if (!AcceptScanEntry(entry, kDrawingNeedle))
            continue;
        // A pipe or a socket shows as an empty file whose attributes cannot be read (under Wine): it is
        // no drawing, and opening it for its preview could wait for a writer for good.
        if (entry.size == 0 && !entry.isDirectory && !IsReadableEntry(folder, found.cFileName))
            continue;
        if (!FullPathFits(folder, entry.name)) {
            ++tooLong; // its preview could not be opened by its name
            continue;
        }
        drawings.emplace_back(std::move(entry));
        progress.found.store(static_cast<int>(drawings.size()), std::memory_order_relaxed);
    } while (::FindNextFileW(search.get(), &found));
    problem = SkippedFilesMessage(tooLong);
    return true;
}

void FileSystemFolderReader::Start(const std::shared_ptr<FolderScan>& scan, unsigned waitMs) {
    HMODULE module = nullptr;
    if (!::GetModuleHandleExW(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS,
                              reinterpret_cast<LPCWSTR>(reinterpret_cast<void*>(&ScanThread)), &module)) {
        RunFolderScan(*this, *scan);
        return;
    }
    ScanThreadStart* start = nullptr;
    try {
        start = new ScanThreadStart{scan, module};
    } catch (...) {
        ::FreeLibrary(module);
        RunFolderScan(*this, *scan);
        return;
    }
    HANDLE thread = ::CreateThread(nullptr, 0, &ScanThread, start, 0, nullptr);
    if (!thread) {
        delete start;
        ::FreeLibrary(module);
        RunFolderScan(*this, *scan);
        return;
    }
    // The thread goes on by itself past the wait; its handle is not kept.
    ::WaitForSingleObject(thread, waitMs);
    ::CloseHandle(thread);
}

void FileSystemFolderReader::MakeCurrentDirectory(const std::string& folder) {
    ::SetCurrentDirectoryA(folder.c_str());
}
