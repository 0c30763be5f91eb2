#include "settings/SettingsPath.h"

#include "ReportedMessages.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

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

// --- forming the name in its 260-character buffer ---

namespace {

std::string Formed(const std::string& moduleFileName, bool* accepted = nullptr) {
    char buffer[kSettingsFileNameSize];
    std::memset(buffer, 'x', sizeof buffer);
    bool ok = FormSettingsFileName(moduleFileName, buffer);
    if (accepted)
        *accepted = ok;
    return buffer;
}

} // namespace

TEST(SettingsPathTest, ModuleExtensionBecomesIni) {
    ReportedMessages reported;
    EXPECT_EQ(Formed("C:\\Tools\\Orvex1.arx"), "C:\\Tools\\Orvex1.ini");
    EXPECT_EQ(Formed("C:\\a.b\\Orvex1"), "C:\\a.b\\Orvex1.ini");
    EXPECT_EQ(Formed("/opt/x.y/lib.so.arx"), "/opt/x.y/lib.so.ini");
    EXPECT_EQ(Formed("C:Orvex1.arx"), "C:Orvex1.ini");
    EXPECT_EQ(Formed("Orvex1.arx"), "Orvex1.ini");
    EXPECT_TRUE(reported.All().empty());
}

TEST(SettingsPathTest, NameOf259CharactersFits) {
    ReportedMessages reported;
    const std::string folder = "C:\\" + std::string(259 - 3 - 11, 'f') + "\\";
    bool accepted = false;
    const std::string formed = Formed(folder + "Orvex1.arx", &accepted);
    EXPECT_TRUE(accepted);
    EXPECT_EQ(formed.size(), 259u);
    EXPECT_EQ(formed, folder + "Orvex1.ini");
    EXPECT_TRUE(reported.All().empty());
}

TEST(SettingsPathTest, TooLongAFolderIsRefusedBeforeAnythingIsCopied) {
    ReportedMessages reported;
    const std::string folder = "C:\\" + std::string(260 - 3 - 11, 'f') + "\\";
    char buffer[kSettingsFileNameSize + 8];
    std::memset(buffer, 'x', sizeof buffer);
    EXPECT_FALSE(FormSettingsFileName(folder + "Orvex1.arx", buffer));
    EXPECT_EQ(buffer[0], '\0');
    EXPECT_EQ(buffer[1], 'x');
    EXPECT_EQ(buffer[kSettingsFileNameSize], 'x');
    EXPECT_EQ(
        reported.All(),
        (std::vector<ReportedMessage>{
            {"\nOrvex: the library's folder is too long for its settings file (260 characters, at most 259); "
             "the explorer uses its default settings and does not save them: " +
                 folder + "Orvex1.ini\n",
             true}}));
}

TEST(SettingsPathTest, VeryLongFolderIsRefused) {
    ReportedMessages reported;
    bool accepted = true;
    EXPECT_EQ(Formed("C:\\" + std::string(5000, 'f') + "\\Orvex1.arx", &accepted), "");
    EXPECT_FALSE(accepted);
    ASSERT_EQ(reported.All().size(), 1u);
    EXPECT_TRUE(reported.All()[0].alert);
}

TEST(SettingsPathTest, UnknownModuleNameIsRefused) {
    ReportedMessages reported;
    bool accepted = true;
    EXPECT_EQ(Formed("", &accepted), "");
    EXPECT_FALSE(accepted);
    ASSERT_EQ(reported.All().size(), 1u);
    EXPECT_TRUE(reported.All()[0].alert);
}

#ifndef _WIN32
TEST(SettingsPathTest, NativelyTooLongACurrentDirectoryGivesNoName) {
    ReportedMessages reported;
    testsupport::TempFolder dir;
    std::filesystem::path deep = dir.Dir();
    while (deep.string().size() < 300)
        deep /= "a-rather-long-folder-name";
    std::filesystem::create_directories(deep);
    const auto before = std::filesystem::current_path();
    std::filesystem::current_path(deep);
    const std::string fileName = ExplorerSettingsPath();
    std::filesystem::current_path(before);
    EXPECT_EQ(fileName, "");
    ASSERT_EQ(reported.All().size(), 1u);
    EXPECT_TRUE(reported.All()[0].alert);
}
#endif
