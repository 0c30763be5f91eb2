// A scratch directory per test, removed afterwards, and whole-file helpers that work on bytes.
#pragma once

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <random>
#include <string>
#include <system_error>

class TempDir {
public:
    TempDir() {
        std::random_device rd;
        const ::testing::TestInfo* info = ::testing::UnitTest::GetInstance()->current_test_info();
        std::string leaf = "orvex-settings-";
        leaf += info ? info->name() : "test";
        leaf += "-" + std::to_string(rd()) + std::to_string(rd());
        m_dir = std::filesystem::temp_directory_path() / leaf;
        std::filesystem::create_directories(m_dir);
    }
    ~TempDir() {
        std::error_code ec;
        std::filesystem::remove_all(m_dir, ec);
    }
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;

    // Narrow path of a file inside the directory.
    std::string File(const std::string& leaf) const { return (m_dir / leaf).string(); }
    std::string Dir() const { return m_dir.string(); }

private:
    std::filesystem::path m_dir;
};

inline void WriteBytes(const std::string& fileName, const std::string& bytes) {
    std::FILE* file = std::fopen(fileName.c_str(), "wb");
    ASSERT_NE(file, nullptr) << fileName;
    if (!bytes.empty()) {
        ASSERT_EQ(std::fwrite(bytes.data(), 1, bytes.size(), file), bytes.size());
    }
    std::fclose(file);
}

inline std::string ReadBytes(const std::string& fileName) {
    std::string bytes;
    std::FILE* file = std::fopen(fileName.c_str(), "rb");
    if (!file)
        return "<missing>";
    char buffer[4096];
    std::size_t n;
    while ((n = std::fread(buffer, 1, sizeof buffer, file)) > 0)
        bytes.append(buffer, n);
    std::fclose(file);
    return bytes;
}

inline bool FileExists(const std::string& fileName) {
    std::error_code ec;
    return std::filesystem::exists(fileName, ec);
}
