// The settings files against other Windows processes: a file held open without sharing, a read-only
// file, and two processes saving the same file at once. Share-mode locks are only seen between
// processes, so settings_helper.exe (beside this program) holds the file or does the second save.
#include "settings/IniFile.h"
#include "settings/IniFileIo.h"
#include "settings/Tessel3Doc.h"

#include "ReportedMessages.h"
#include "TaggedStore.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <windows.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <string>
#include <vector>

using namespace testsupport; // TempFolder and the whole-file helpers

namespace {

std::string HelperPath() {
    char exe[MAX_PATH] = "";
    ::GetModuleFileNameA(nullptr, exe, MAX_PATH);
    return (std::filesystem::path(exe).parent_path() / "settings_helper.exe").string();
}

// One run of settings_helper.exe.
class Helper {
public:
    explicit Helper(const std::string& arguments) {
        std::string commandLine = "\"" + HelperPath() + "\" " + arguments;
        STARTUPINFOA startup{};
        startup.cb = sizeof startup;
        m_started = ::CreateProcessA(nullptr, &commandLine[0], nullptr, nullptr, FALSE, 0, nullptr, nullptr,
                                     &startup, &m_process) != FALSE;
    }
    ~Helper() {
        if (m_started) {
            ::WaitForSingleObject(m_process.hProcess, 30000);
            ::CloseHandle(m_process.hProcess);
            ::CloseHandle(m_process.hThread);
        }
    }
    Helper(const Helper&) = delete;
    Helper& operator=(const Helper&) = delete;

    bool Started() const { return m_started; }
    // The exit status, or -1 when it did not end in time.
    int Wait() {
        if (!m_started || ::WaitForSingleObject(m_process.hProcess, 60000) != WAIT_OBJECT_0)
            return -1;
        DWORD code = 0;
        ::GetExitCodeProcess(m_process.hProcess, &code);
        return static_cast<int>(code);
    }

private:
    PROCESS_INFORMATION m_process{};
    bool m_started = false;
};

// Another process holds a file open without sharing until Release (or the object goes).
class FileHolder {
public:
    FileHolder(const TempFolder& signals, const std::string& fileName)
        : m_ready(signals.File("ready")), m_release(signals.File("release")),
          m_helper("hold \"" + fileName + "\" \"" + m_ready + "\" \"" + m_release + "\" 60000") {
        for (int i = 0; i < 1000 && !FileExists(m_ready); ++i)
            ::Sleep(20);
    }
    ~FileHolder() { Release(); }

    bool Holding() const { return m_helper.Started() && FileExists(m_ready); }
    void Release() {
        WriteBytes(m_release, "");
        m_helper.Wait();
    }

private:
    std::string m_ready;
    std::string m_release;
    Helper m_helper;
};

std::string NotSaved(const std::string& fileName, const std::string& why) {
    return "\nOrvex: " + fileName + " was not saved: " + why + "; the file is left as it was\n";
}

class SettingsWinTest : public ::testing::Test {
protected:
    TempFolder m_dir;
    TempFolder m_signals; // the holder's ready and release files, apart from the settings file
    ReportedMessages m_reported;
};

} // namespace

TEST_F(SettingsWinTest, LockedSettingsFileGivesDefaultsAndIsLeftAsItWas) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=2\r\n\r\n[Size]\r\nSplitterSize=250\r\n\r\n";
    WriteBytes(fileName, text);
    {
        FileHolder holder(m_signals, fileName);
        ASSERT_TRUE(holder.Holding());
        {
            CTessel3Doc doc(fileName);
            EXPECT_EQ(doc.m_nSort, 0);
            EXPECT_EQ(doc.m_nSplitterSize, 100);
            doc.m_nSort = 1;
        }
        // Saved only after the lock is gone, the file still must not get the defaults.
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(fileName, "it could not be read")});
}

TEST_F(SettingsWinTest, LockReleasedBeforeTheCloseStillKeepsTheFile) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=2\r\n\r\n";
    WriteBytes(fileName, text);
    auto holder = std::make_unique<FileHolder>(m_signals, fileName);
    ASSERT_TRUE(holder->Holding());
    auto doc = std::make_unique<CTessel3Doc>(fileName);
    holder.reset();
    doc.reset();
    EXPECT_EQ(ReadBytes(fileName), text);
}

TEST_F(SettingsWinTest, SavingOverALockedFileFailsCleanly) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=2\r\n\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ini.SetValue("View", "Sort", "0");
    {
        FileHolder holder(m_signals, fileName);
        ASSERT_TRUE(holder.Holding());
        EXPECT_FALSE(ini.WriteFile());
        EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{NotSaved(fileName, "it is in use by another program")});
    // Once the other program lets go, the save goes through.
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[View]\r\nSort=0\r\n\r\n");
}

TEST_F(SettingsWinTest, ReadOnlyAttributeRefusesTheSave) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=2\r\n\r\n";
    WriteBytes(fileName, text);
    ASSERT_TRUE(::SetFileAttributesA(fileName.c_str(), FILE_ATTRIBUTE_READONLY));
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nSort, 2);
        doc.m_nSort = 1;
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(fileName, "it is read-only")});
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
    ::SetFileAttributesA(fileName.c_str(), FILE_ATTRIBUTE_NORMAL);
}

TEST_F(SettingsWinTest, AFullDiskLeavesTheOldFileWholeAndSaysSo) {
    // The explorer's settings of a user, with a section of their own, closed on a disk with room for 40
    // bytes: the temporary file takes what fits, then the write fails.
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text =
        "[Mine]\r\nkeep=me\r\n\r\n[View]\r\nSort=2\r\n\r\n[Size]\r\nSplitterSize=250\r\n\r\n";
    WriteBytes(fileName, text);
    SetDiskRoomForTesting(40);
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nSort, 2);
        doc.m_nSort = 1;
    }
    SetDiskRoomForTesting(-1);
    EXPECT_EQ(ReadBytes(fileName), text) << "nothing the user had is lost";
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"}) << "no temporary file is left";
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(fileName, "the disk is full")});
    // With room again the next close saves.
    {
        CTessel3Doc doc(fileName);
        doc.m_nSort = 1;
    }
    EXPECT_NE(ReadBytes(fileName).find("Sort=1\r\n"), std::string::npos);
    EXPECT_NE(ReadBytes(fileName).find("[Mine]\r\nkeep=me\r\n"), std::string::npos);
}

TEST_F(SettingsWinTest, TwoProcessesSavingAtOnceLeaveOneWholeFile) {
    std::string expectedA, expectedB;
    for (const char* tag : {"A", "B"}) {
        CIniFile ini(m_signals.File(std::string("expected-") + tag + ".ini"));
        FillTaggedStore(ini, tag);
        ASSERT_TRUE(ini.WriteFile());
        (tag[0] == 'A' ? expectedA : expectedB) = ReadBytes(ini.path);
    }
    std::string fileName = m_dir.File("Orvex1.ini");
    {
        Helper first("write \"" + fileName + "\" A 40");
        Helper second("write \"" + fileName + "\" B 40");
        ASSERT_TRUE(first.Started());
        ASSERT_TRUE(second.Started());
        EXPECT_EQ(first.Wait(), 0);
        EXPECT_EQ(second.Wait(), 0);
    }
    const std::string result = ReadBytes(fileName);
    EXPECT_TRUE(result == expectedA || result == expectedB) << result.size() << " bytes";
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
}
