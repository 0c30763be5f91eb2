// Portable build: POSIX files; rename() replaces the target in one step.
#include "settings/IniFileIo.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

std::atomic<unsigned long> g_replacements{0};
std::atomic<long long> g_diskRoomForTesting{-1};

std::string WriteFailure(int error) {
    if (error == ENOSPC || error == EDQUOT)
        return "the disk is full";
    return std::string("writing failed: ") + std::strerror(error);
}

bool WriteAll(int fd, const std::string& bytes, int& error) {
    const long long room = g_diskRoomForTesting;
    std::size_t done = 0;
    while (done < bytes.size()) {
        std::size_t chunk = bytes.size() - done;
        if (room >= 0 && static_cast<unsigned long long>(room) < done + chunk) {
            if (static_cast<unsigned long long>(room) <= done) {
                error = ENOSPC;
                return false;
            }
            chunk = static_cast<std::size_t>(room) - done;
        }
        ssize_t n = ::write(fd, bytes.data() + done, chunk);
        if (n < 0 && errno == EINTR)
            continue;
        if (n <= 0) {
            error = n < 0 ? errno : ENOSPC;
            return false;
        }
        done += static_cast<std::size_t>(n);
    }
    return true;
}

} // namespace

void SetDiskRoomForTesting(long long bytes) {
    g_diskRoomForTesting = bytes;
}

WholeFileRead ReadWholeFile(const std::string& fileName, std::size_t maxBytes, std::string& bytes,
                            unsigned long long* fileSize) {
    struct stat st;
    if (::stat(fileName.c_str(), &st) != 0)
        return WholeFileRead::Missing;
    // Non-blocking, so a pipe in the file's place cannot hang the open; only regular files are read.
    int fd = ::open(fileName.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK);
    if (fd < 0)
        return WholeFileRead::CannotOpen;
    WholeFileRead result = WholeFileRead::Read;
    if (::fstat(fd, &st) != 0 || !S_ISREG(st.st_mode)) {
        result = WholeFileRead::CannotOpen;
    } else if (static_cast<unsigned long long>(st.st_size) > maxBytes) {
        result = WholeFileRead::TooLarge;
    } else {
        // Room for one byte more than fstat gave: a file that grew meanwhile is still seen whole, and
        // one that grew past the limit is seen to be too large.
        bytes.assign(static_cast<std::size_t>(st.st_size) + 1, '\0');
        std::size_t done = 0;
        for (;;) {
            if (done == bytes.size()) {
                if (bytes.size() > maxBytes)
                    break;
                bytes.resize(bytes.size() * 2 > maxBytes + 1 ? maxBytes + 1 : bytes.size() * 2);
            }
            ssize_t n = ::read(fd, &bytes[done], bytes.size() - done);
            if (n < 0 && errno == EINTR)
                continue;
            if (n < 0) {
                result = WholeFileRead::Failed;
                break;
            }
            if (n == 0)
                break;
            done += static_cast<std::size_t>(n);
        }
        bytes.resize(done);
        if (result == WholeFileRead::Read && done > maxBytes)
            result = WholeFileRead::TooLarge;
    }
    ::close(fd);
    if (result == WholeFileRead::TooLarge && fileSize)
        *fileSize = std::max<unsigned long long>(static_cast<unsigned long long>(st.st_size), bytes.size());
    if (result != WholeFileRead::Read)
        bytes.clear();
    return result;
}

bool ReplaceWholeFile(const std::string& fileName, const std::string& bytes, std::string& reason) {
    // What Windows refuses, the portable build refuses too: a read-only file (whoever runs) or a folder.
    struct stat target;
    const bool exists = ::stat(fileName.c_str(), &target) == 0;
    if (exists && S_ISDIR(target.st_mode)) {
        reason = "a folder has its name";
        return false;
    }
    if (exists && (target.st_mode & (S_IWUSR | S_IWGRP | S_IWOTH)) == 0) {
        reason = "it is read-only";
        return false;
    }

    const unsigned long processId = static_cast<unsigned long>(::getpid());
    std::string temporary;
    int fd = -1;
    for (int attempt = 0; attempt < 100 && fd < 0; ++attempt) {
        temporary = TemporaryFileBeside(fileName, processId, ++g_replacements);
        fd = ::open(temporary.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0666);
        if (fd < 0 && errno != EEXIST)
            break;
    }
    if (fd < 0) {
        reason = std::string("no file can be made in its folder: ") + std::strerror(errno);
        return false;
    }
    if (exists)
        ::fchmod(fd, target.st_mode & 07777); // the new file keeps the old one's permissions

    int error = 0;
    bool written = WriteAll(fd, bytes, error);
    if (written && ::fsync(fd) != 0) {
        written = false;
        error = errno;
    }
    if (::close(fd) != 0 && written) {
        written = false;
        error = errno;
    }
    if (written && std::rename(temporary.c_str(), fileName.c_str()) != 0) {
        reason = std::string("it could not be replaced: ") + std::strerror(errno);
        ::unlink(temporary.c_str());
        return false;
    }
    if (!written) {
        reason = WriteFailure(error);
        ::unlink(temporary.c_str());
        return false;
    }
    return true;
}
