// Windows: files opened with full sharing for reading, and replaced with MoveFileExA, which swaps the
// directory entry in one step and, written through, is on the disk when it returns.
#include "settings/IniFileIo.h"

#include <windows.h>

#include <atomic>

namespace {

std::atomic<unsigned long> g_replacements{0};
std::atomic<long long> g_diskRoomForTesting{-1};

// Closes a file handle when it goes.
class FileHandle {
public:
    explicit FileHandle(HANDLE handle) : m_handle(handle) {}
    ~FileHandle() { Close(); }
    FileHandle(const FileHandle&) = delete;
    FileHandle& operator=(const FileHandle&) = delete;

    bool IsValid() const { return m_handle != INVALID_HANDLE_VALUE; }
    HANDLE Get() const { return m_handle; }
    bool Close() {
        if (!IsValid())
            return true;
        const BOOL closed = ::CloseHandle(m_handle);
        m_handle = INVALID_HANDLE_VALUE;
        return closed != FALSE;
    }

private:
    HANDLE m_handle;
};

std::string Reason(DWORD error) {
    switch (error) {
    case ERROR_SHARING_VIOLATION:
    case ERROR_LOCK_VIOLATION:
        return "it is in use by another program";
    case ERROR_ACCESS_DENIED:
        return "access was denied";
    case ERROR_DISK_FULL:
    case ERROR_HANDLE_DISK_FULL:
        return "the disk is full";
    case ERROR_PATH_NOT_FOUND:
        return "its folder does not exist";
    case ERROR_WRITE_PROTECT:
        return "the disk is write-protected";
    default:
        return "Windows error " + std::to_string(error);
    }
}

bool WriteAll(HANDLE file, const std::string& bytes) {
    const long long room = g_diskRoomForTesting;
    std::size_t done = 0;
    while (done < bytes.size()) {
        std::size_t chunk = bytes.size() - done < 0x10000000 ? bytes.size() - done : 0x10000000;
        if (room >= 0 && static_cast<unsigned long long>(room) < done + chunk) {
            if (static_cast<unsigned long long>(room) <= done) {
                ::SetLastError(ERROR_DISK_FULL);
                return false;
            }
            chunk = static_cast<std::size_t>(room) - done;
        }
        DWORD written = 0;
        if (!::WriteFile(file, bytes.data() + done, static_cast<DWORD>(chunk), &written, nullptr))
            return false;
        if (written == 0) {
            ::SetLastError(ERROR_DISK_FULL);
            return false;
        }
        done += written;
    }
    return true;
}

// Moves the written file over the target. Another program saving or reading the same file at that
// moment can make one attempt fail; a few short retries get past that.
bool MoveOver(const std::string& temporary, const std::string& fileName) {
    for (int attempt = 1;; ++attempt) {
        if (::MoveFileExA(temporary.c_str(), fileName.c_str(),
                          MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH))
            return true;
        const DWORD error = ::GetLastError();
        const bool passing =
            error == ERROR_ACCESS_DENIED || error == ERROR_SHARING_VIOLATION || error == ERROR_LOCK_VIOLATION;
        if (!passing || attempt == 5)
            return false;
        ::Sleep(10 * attempt);
        ::SetLastError(error);
    }
}

} // namespace

void SetDiskRoomForTesting(long long bytes) {
    g_diskRoomForTesting = bytes;
}

WholeFileRead ReadWholeFile(const std::string& fileName, std::size_t maxBytes, std::string& bytes,
                            unsigned long long* fileSize) {
    const DWORD attributes = ::GetFileAttributesA(fileName.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return WholeFileRead::Missing;
    if (attributes & FILE_ATTRIBUTE_DIRECTORY)
        return WholeFileRead::CannotOpen;
    FileHandle file(::CreateFileA(fileName.c_str(), GENERIC_READ,
                                  FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                  OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    if (!file.IsValid())
        return WholeFileRead::CannotOpen;
    if (::GetFileType(file.Get()) != FILE_TYPE_DISK)
        return WholeFileRead::CannotOpen;
    LARGE_INTEGER size;
    if (!::GetFileSizeEx(file.Get(), &size))
        return WholeFileRead::Failed;
    if (fileSize)
        *fileSize = static_cast<unsigned long long>(size.QuadPart);
    if (static_cast<unsigned long long>(size.QuadPart) > maxBytes)
        return WholeFileRead::TooLarge;

    // Room for one byte more than the size: a file that grew past the limit meanwhile is seen to.
    bytes.assign(static_cast<std::size_t>(size.QuadPart) + 1, '\0');
    std::size_t done = 0;
    for (;;) {
        if (done == bytes.size()) {
            if (bytes.size() > maxBytes)
                break;
            bytes.resize(bytes.size() * 2 > maxBytes + 1 ? maxBytes + 1 : bytes.size() * 2);
        }
        DWORD n = 0;
        if (!::ReadFile(file.Get(), &bytes[done], static_cast<DWORD>(bytes.size() - done), &n, nullptr)) {
            bytes.clear();
            return WholeFileRead::Failed;
        }
        if (n == 0)
            break;
        done += n;
    }
    if (done > maxBytes) {
        if (fileSize)
            *fileSize = done;
        bytes.clear();
        return WholeFileRead::TooLarge;
    }
    bytes.resize(done);
    return WholeFileRead::Read;
}

bool ReplaceWholeFile(const std::string& fileName, const std::string& bytes, std::string& reason) {
    const DWORD attributes = ::GetFileAttributesA(fileName.c_str());
    const bool exists = attributes != INVALID_FILE_ATTRIBUTES;
    if (exists && (attributes & FILE_ATTRIBUTE_DIRECTORY)) {
        reason = "a folder has its name";
        return false;
    }
    if (exists && (attributes & FILE_ATTRIBUTE_READONLY)) {
        reason = "it is read-only";
        return false;
    }
    if (exists) {
        // Moving over a file needs the right to delete it; a program holding it open without sharing
        // that refuses, and saying so before writing anything is clearer than a failed move.
        FileHandle probe(::CreateFileA(fileName.c_str(), DELETE,
                                       FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                                       OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
        if (!probe.IsValid() && ::GetLastError() == ERROR_SHARING_VIOLATION) {
            reason = Reason(ERROR_SHARING_VIOLATION);
            return false;
        }
    }

    const unsigned long processId = ::GetCurrentProcessId();
    std::string temporary;
    HANDLE created = INVALID_HANDLE_VALUE;
    for (int attempt = 0; attempt < 100 && created == INVALID_HANDLE_VALUE; ++attempt) {
        temporary = TemporaryFileBeside(fileName, processId, ++g_replacements);
        created = ::CreateFileA(temporary.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                FILE_ATTRIBUTE_NORMAL, nullptr);
        if (created == INVALID_HANDLE_VALUE && ::GetLastError() != ERROR_FILE_EXISTS &&
            ::GetLastError() != ERROR_ALREADY_EXISTS)
            break;
    }
    if (created == INVALID_HANDLE_VALUE) {
        reason = "no file can be made in its folder (" + Reason(::GetLastError()) + ")";
        return false;
    }

    FileHandle file(created);
    bool written = WriteAll(file.Get(), bytes) && ::FlushFileBuffers(file.Get());
    DWORD error = written ? ERROR_SUCCESS : ::GetLastError();
    if (!file.Close() && written) {
        written = false;
        error = ::GetLastError();
    }
    if (written && !MoveOver(temporary, fileName)) {
        written = false;
        error = ::GetLastError();
    }
    if (!written) {
        reason = Reason(error);
        ::DeleteFileA(temporary.c_str());
        return false;
    }
    return true;
}
