#include "settings/SettingsPath.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>

#ifdef _WIN32
#include <windows.h>
#endif

TEST(SettingsPathTest, BufferAndStringFormsAgree) {
    char buffer[kSettingsFileNameSize];
    std::memset(buffer, 'x', sizeof buffer);
    GetSettingsFileName(buffer);
    EXPECT_LT(std::strlen(buffer), static_cast<std::size_t>(kSettingsFileNameSize));
    EXPECT_EQ(std::string(buffer), ExplorerSettingsPath());
}

TEST(SettingsPathTest, HasTheIniExtension) {
    std::string fileName = ExplorerSettingsPath();
    ASSERT_GE(fileName.size(), 4u);
    EXPECT_EQ(fileName.substr(fileName.size() - 4), ".ini");
}

#ifdef _WIN32
// The test program is not loaded as the extension module, so the file is named after the executable,
// beside it.
TEST(SettingsPathTest, FallsBackToTheExecutableWhenTheModuleIsNotLoaded) {
    ASSERT_EQ(GetModuleHandleA(kSettingsModuleName), nullptr);
    char exe[MAX_PATH] = "";
    ASSERT_GT(GetModuleFileNameA(nullptr, exe, MAX_PATH), 0u);
    std::string expected = exe;
    std::string::size_type dot = expected.find_last_of('.');
    ASSERT_NE(dot, std::string::npos);
    expected = expected.substr(0, dot) + ".ini";
    EXPECT_EQ(ExplorerSettingsPath(), expected);
}
#else
TEST(SettingsPathTest, NativelyLiesInTheCurrentDirectory) {
    std::filesystem::path expected = std::filesystem::current_path() / "Orvex1.ini";
    EXPECT_EQ(ExplorerSettingsPath(), expected.string());
}
#endif
