#include "tests/support/TempFolder.h"

#include "tests/support/FileBytes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <random>
#include <system_error>

namespace testsupport {

namespace fs = std::filesystem;

TempFolder::TempFolder(const std::string& prefix) {
    std::random_device random;
    std::error_code ec;
    const fs::path base = fs::temp_directory_path(ec);
    for (int attempt = 0; attempt < 100; ++attempt) {
        char suffix[32];
        std::snprintf(suffix, sizeof suffix, "-%08x%08x", static_cast<unsigned>(random()),
                      static_cast<unsigned>(random()));
        fs::path candidate = base / (prefix + suffix);
        if (fs::create_directories(candidate, ec)) { // true only for a folder this call made
            m_path = std::move(candidate);
            break;
        }
    }
    if (m_path.empty())
        ADD_FAILURE() << "no temporary folder could be created under " << base.string();
    m_dir = m_path.string();
}

TempFolder::~TempFolder() {
    if (m_path.empty())
        return;
    std::error_code ec;
    // A current directory inside the folder would keep it from going on Windows.
    for (fs::path p = fs::current_path(ec); !ec && !p.empty(); p = p.parent_path()) {
        if (fs::equivalent(p, m_path, ec)) {
            fs::current_path(m_path.parent_path(), ec);
            break;
        }
        if (p == p.parent_path())
            break;
    }
    fs::remove_all(m_path, ec);
}

// Joined as text: a narrow name in the system code page must reach the file functions as it is.
std::string TempFolder::File(const std::string& name) const {
#ifdef _WIN32
    return m_dir + '\\' + name;
#else
    return m_dir + '/' + name;
#endif
}

std::string TempFolder::Write(const std::string& name, const std::string& bytes) const {
    const std::string path = File(name);
    WriteBytes(path, bytes);
    return path;
}

std::string TempFolder::MakeDir(const std::string& name) const {
    std::error_code ec;
    fs::create_directories(m_path / name, ec);
    EXPECT_FALSE(ec) << name << ": " << ec.message();
    return File(name);
}

bool TempFolder::Exists(const std::string& name) const {
    return FileExists(File(name));
}

void WriteBytes(const std::string& fileName, const std::string& bytes) {
    std::FILE* file = std::fopen(fileName.c_str(), "wb");
    ASSERT_NE(file, nullptr) << fileName;
    if (!bytes.empty()) {
        EXPECT_EQ(std::fwrite(bytes.data(), 1, bytes.size(), file), bytes.size()) << fileName;
    }
    std::fclose(file);
}

std::string ReadBytes(const std::string& fileName) {
    std::string bytes;
    return ReadFileBytes(fileName, bytes) ? bytes : "<missing>";
}

bool FileExists(const std::string& fileName) {
    std::error_code ec;
    return fs::exists(fileName, ec);
}

std::vector<std::string> FilesIn(const std::string& dir) {
    std::vector<std::string> files;
    for (const auto& entry : fs::directory_iterator(dir))
        files.push_back(entry.path().filename().string());
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace testsupport
