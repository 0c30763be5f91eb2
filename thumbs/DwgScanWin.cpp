// The folder scan over the runtime library's file search (Windows build only).
#include "thumbs/DwgList.h"

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

DwgFindEntry EntryOf(const struct _finddata64i32_t& found) {
    DwgFindEntry entry;
    entry.name = found.name;
    entry.isDirectory = (found.attrib & _A_SUBDIR) != 0;
    entry.timeWrite = found.time_write;
    entry.size = static_cast<std::uint32_t>(found.size);
    return entry;
}

} // namespace

int ScanFolderPath(const char* path, const char* needle, std::string* problem) {
    BeginScan();
    if (problem)
        problem->clear();
    if (path == nullptr || *path == '\0')
        return 0;
    const std::string folder(path);
    // Refused before the current directory or the pattern is made: neither may be cut short.
    if (std::string refused = FolderPathProblem(folder); !refused.empty()) {
        if (problem)
            *problem = std::move(refused);
        return 0;
    }
    ::SetCurrentDirectoryA(folder.c_str());

    std::string pattern = folder;
    if (pattern.back() != '\\' && pattern.back() != '/')
        pattern += '\\';
    pattern += '*';
    struct _finddata64i32_t found;
    FindHandle search(_findfirst64i32(pattern.c_str(), &found));
    if (search.get() == -1)
        return 0;
    std::vector<DwgData> records;
    int tooLong = 0;
    do {
        DwgFindEntry entry = EntryOf(found);
        if (!AcceptScanEntry(entry, needle))
            continue;
        if (!FullPathFits(folder, entry.name)) {
            ++tooLong; // its preview could not be opened by its name
            continue;
        }
        records.emplace_back(std::move(entry));
    } while (_findnext64i32(search.get(), &found) == 0);
    AppendScanRecords(std::move(records));
    EndScan();
    if (problem)
        *problem = SkippedFilesMessage(tooLong);
    return 1;
}
