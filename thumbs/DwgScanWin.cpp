// The folder scan over the runtime library's file search, and the pick's check of a name (Windows only).
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "thumbs/NameFold.h"

#include <cerrno>
#include <windows.h>

#include <io.h>

#include <string>
#include <utility>
#include <vector>

namespace {

// Closes the search handle however the scan ends.
class FindHandle {
public:
    explicit FindHandle(intptr_t handle) : m_handle(handle) {}
    FindHandle(const FindHandle&) = delete;
    FindHandle& operator=(const FindHandle&) = delete;
    ~FindHandle() {
        if (m_handle != -1)
            _findclose(m_handle);
    }
    intptr_t get() const { return m_handle; }

private:
    intptr_t m_handle;
};

DwgFindEntry EntryOf(const struct __finddata64_t& found) {
    DwgFindEntry entry;
    entry.name = found.name;
    entry.isDirectory = (found.attrib & _A_SUBDIR) != 0;
    entry.timeWrite = found.time_write;
    entry.size = static_cast<std::uint64_t>(found.size);
    return entry;
}

bool IsReadableEntry(const std::string& folder, const char* name) {
    return ::GetFileAttributesA(DrawingFolder::Join(folder, name).c_str()) != INVALID_FILE_ATTRIBUTES;
}

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

bool FileSystemFolderReader::Read(const std::string& folder, std::vector<DwgData>& drawings,
                                  std::string& problem) {
    drawings.clear();
    problem.clear();
    if (folder.empty())
        return false;
    // Refused before the pattern is made: it may not be cut short.
    if (std::string refused = FolderPathProblem(folder); !refused.empty()) {
        problem = std::move(refused);
        return false;
    }
    std::string pattern = DrawingFolder::Join(folder, "*");
    // The 64-bit size: a 32-bit one turns a file of 2 GiB and more into a negative or wrong size.
    struct __finddata64_t found;
    FindHandle search(_findfirst64(pattern.c_str(), &found));
    if (search.get() == -1) {
        const int findError = errno;
        const DWORD attributes = ::GetFileAttributesA(folder.c_str());
        const DWORD error = ::GetLastError();
        const bool isFolder =
            attributes != INVALID_FILE_ATTRIBUTES && (attributes & FILE_ATTRIBUTE_DIRECTORY);
        // A drive's root without a single entry lists nothing, not even "." and "..": read, and empty.
        if (isFolder && findError == ENOENT)
            return true;
        if (isFolder)
            problem = UnreadableFolderMessage(folder, false, findError == EACCES ? ERROR_ACCESS_DENIED : 0);
        else
            problem = UnreadableFolderMessage(folder, attributes != INVALID_FILE_ATTRIBUTES, error);
        return false;
    }
    int tooLong = 0;
    do {
        DwgFindEntry entry = EntryOf(found);
        if (!AcceptScanEntry(entry, kDrawingNeedle))
            continue;
        // A pipe or a socket shows as an empty file whose attributes cannot be read (under Wine): it is
        // no drawing, and opening it for its preview could wait for a writer for good.
        if (entry.size == 0 && !entry.isDirectory && !IsReadableEntry(folder, found.name))
            continue;
        if (!FullPathFits(folder, entry.name)) {
            ++tooLong; // its preview could not be opened by its name
            continue;
        }
        drawings.emplace_back(std::move(entry));
    } while (_findnext64(search.get(), &found) == 0);
    problem = SkippedFilesMessage(tooLong);
    return true;
}

void FileSystemFolderReader::MakeCurrentDirectory(const std::string& folder) {
    ::SetCurrentDirectoryA(folder.c_str());
}
