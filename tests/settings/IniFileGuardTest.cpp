// What the ini store does with files it cannot or must not take: too large, too long a line, lines a
// save would change, unreadable, read-only, a folder; how it replaces a file; the look-up index.
#include "settings/IniFile.h"
#include "settings/IniFileIo.h"

#include "ReportedMessages.h"
#include "TaggedStore.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <atomic>
#include <climits>
#include <filesystem>
#include <random>
#include <string>
#include <thread>
#include <utility>
#include <vector>

#ifndef _WIN32
#include <csignal>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>
#endif

using namespace testsupport; // TempFolder and the whole-file helpers

namespace {

// A file of exactly `size` bytes: section S with 100-byte value lines k0000000=vvv...
std::string IniOfSize(std::size_t size) {
    std::string text = "[S]\r\n";
    const std::size_t lines = (size - text.size()) / 100 - 1;
    char name[16];
    for (std::size_t i = 0; i < lines; ++i) {
        std::snprintf(name, sizeof name, "k%07u=", static_cast<unsigned>(i));
        text += name + std::string(89, 'v') + "\r\n";
    }
    const std::size_t last = size - text.size(); // 100..199 bytes
    text += "last=" + std::string(last - 7, 'v') + "\r\n";
    return text;
}

void MakeReadOnly(const std::string& fileName, bool readOnly) {
    using std::filesystem::perms;
    std::filesystem::permissions(fileName, perms::owner_write | perms::group_write | perms::others_write,
                                 readOnly ? std::filesystem::perm_options::remove
                                          : std::filesystem::perm_options::add);
}

std::string NotSaved(const std::string& fileName, const std::string& why) {
    return "\nOrvex: " + fileName + " was not saved: " + why + "; the file is left as it was\n";
}

class IniGuardTest : public ::testing::Test {
protected:
    TempFolder m_dir;
    ReportedMessages m_reported;
};

} // namespace

// --- files too large ---

TEST_F(IniGuardTest, FileOfExactly1MiBIsRead) {
    std::string fileName = m_dir.File("big.ini");
    std::string text = IniOfSize(kMaxIniFileBytes);
    ASSERT_EQ(text.size(), kMaxIniFileBytes);
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    EXPECT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("S", "k0000000"), std::string(89, 'v'));
    EXPECT_EQ(ini.GetNumValues("S"), static_cast<int>((kMaxIniFileBytes - 5) / 100));
    EXPECT_TRUE(m_reported.All().empty());
    EXPECT_TRUE(ini.WriteFile());
}

TEST_F(IniGuardTest, FileOneByteOver1MiBIsRefusedAndSaidOnce) {
    std::string fileName = m_dir.File("big.ini");
    WriteBytes(fileName, IniOfSize(kMaxIniFileBytes + 1));
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.error, "Ini file is larger than 1 MiB.");
    EXPECT_EQ(ini.GetNumKeys(), 0);
    EXPECT_EQ(m_reported.All(),
              (std::vector<ReportedMessage>{
                  {"\nOrvex: " + fileName + " is larger than 1 MiB; it was not read\n", false}}));
}

TEST_F(IniGuardTest, OverSizeFileReadAgainIsSaidOnlyOnce) {
    std::string fileName = m_dir.File("datains.ini");
    WriteBytes(fileName, IniOfSize(kMaxIniFileBytes + 100));
    for (int i = 0; i < 3; ++i) {
        CIniFile ini(fileName);
        EXPECT_FALSE(ini.ReadFile());
    }
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{"\nOrvex: " + fileName + " is larger than 1 MiB; it was not read\n"});
    // Grown further, it is news again.
    WriteBytes(fileName, IniOfSize(kMaxIniFileBytes + 200));
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(m_reported.Texts().size(), 2u);
}

TEST_F(IniGuardTest, ThreeHundredThousandKeysAreRefusedAndTheFileIsNeverWrittenOver) {
    std::string fileName = m_dir.File("datains.ini");
    std::string text = "[Default Parameters]\r\nLayer=Walls\r\nColor=3\r\n";
    for (int i = 0; i < 300000; ++i)
        text += "key" + std::to_string(i) + "=" + std::to_string(i) + "\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("Default Parameters", "Layer"), "");
    ini.SetValue("Default Parameters", "Layer", "0");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(),
              (std::vector<std::string>{"\nOrvex: " + fileName + " is larger than 1 MiB; it was not read\n",
                                        NotSaved(fileName, "it is larger than 1 MiB")}));
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"datains.ini"});
}

TEST_F(IniGuardTest, TenMiBFileIsRefused) {
    std::string fileName = m_dir.File("huge.ini");
    std::string text;
    while (text.size() < 10u * 1024 * 1024)
        text += "[S]\r\na=b\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.GetNumKeys(), 0);
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName).size(), text.size());
}

// --- files not taken whole: never written over ---

TEST_F(IniGuardTest, LineOf3000CharactersKeepsTheFileByteForByte) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text =
        "[S]\r\nfirst=1\r\nlong=" + std::string(2995, 'x') + "\r\nlast=2\r\n[T]\r\nt=3\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    EXPECT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("S", "first"), "1");
    ini.SetValue("S", "first", "changed");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.All(), (std::vector<ReportedMessage>{
                                    {NotSaved(fileName, "line 3 is longer than 2047 characters"), false}}));
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
}

TEST_F(IniGuardTest, LongLastLineWithoutLineEndAlsoKeepsTheFile) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[S]\r\nfirst=1\r\n" + std::string(2048, 'x');
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    EXPECT_TRUE(ini.ReadFile());
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
}

// --- values the reader would not take back ---

TEST_F(IniGuardTest, AValueOfTheLongestReadableLineIsWrittenAndReadBackWithWhatFollows) {
    std::string fileName = m_dir.File("datains.ini");
    const std::string command(static_cast<std::size_t>(MaxIniValueChars("Lisp command")), 'c');
    EXPECT_EQ(command.size(), 2034u); // "Lisp command=" and the value fill the reader's 2047 characters
    CIniFile ini(fileName);
    ini.SetValue("Default Parameters", "Layer", "LONG");
    ini.SetValue("Default Parameters", "Lisp command", command);
    ini.SetValue("Default Parameters", "Color", "5");
    ASSERT_TRUE(ini.WriteFile());
    CIniFile back(fileName);
    ASSERT_TRUE(back.ReadFile());
    EXPECT_EQ(back.GetValue("Default Parameters", "Lisp command"), command);
    EXPECT_EQ(back.GetValue("Default Parameters", "Color"), "5");
    back.SetValue("Default Parameters", "Color", "6");
    EXPECT_TRUE(back.WriteFile()) << "a file the store wrote is one it can save again";
    EXPECT_TRUE(m_reported.All().empty());
}

TEST_F(IniGuardTest, ValuesTheReaderWouldNotTakeBackAreNeverWritten) {
    struct Case {
        std::string section, name, value, why;
    };
    const std::vector<Case> cases = {
        {"Default Parameters", "Lisp command", std::string(2158, 'c'),
         "the value of Lisp command is 2158 characters long, at most 2034 can be read back in "
         "[Default Parameters]"},
        {"CurrentPath", "Path", "Z:\\a\nb\\", "the value of Path holds a line break in [CurrentPath]"},
        {"CurrentPath", "Path", "Z:\\a\r\n[View]\r\nb\\",
         "the value of Path holds a line break in [CurrentPath]"},
        {"S", "a=b", "1", "the name \"a=b\" holds an = in [S]"},
        {"S", "x\ny", "1", "the name \"x\\ny\" holds a line break in [S]"},
        {"S", "[a", "b]", "the line of [a would read as a [section] in [S]"},
        {"S\nT", "a", "1", "the section name \"S\\nT\" holds a line break"},
        {"[S", "a", "1", "the section name \"[S\" begins with [ or ends with ]"},
    };
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string before = "[CurrentPath]\r\nPath=Z:\\dwg\\\r\n\r\n";
    for (const Case& c : cases) {
        WriteBytes(fileName, before);
        m_reported.Clear();
        CIniFile ini(fileName);
        ASSERT_TRUE(ini.ReadFile());
        ini.SetValue(c.section, c.name, c.value);
        EXPECT_FALSE(ini.WriteFile()) << c.why;
        EXPECT_EQ(ReadBytes(fileName), before) << c.why;
        EXPECT_EQ(m_reported.All(), (std::vector<ReportedMessage>{{NotSaved(fileName, c.why), false}}));
        EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
    }
}

TEST_F(IniGuardTest, ACarriageReturnAloneReadsBackAndIsWritten) {
    // The reader ends a line only at a line feed: a carriage return inside a value is an ordinary
    // character, and a file holding one can be saved again.
    std::string fileName = m_dir.File("Orvex1.ini");
    CIniFile ini(fileName);
    ini.SetValue("S", "a", "x\ry\r");
    ASSERT_TRUE(ini.WriteFile());
    CIniFile back(fileName);
    ASSERT_TRUE(back.ReadFile());
    EXPECT_EQ(back.GetValue("S", "a"), "x\ry\r");
    EXPECT_TRUE(back.WriteFile());
}

TEST_F(IniGuardTest, AStoreThatDidNotReadAFileWholeStillSavesElsewhere) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\n" + std::string(3000, 'x') + "\r\n");
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ini.SetValue("S", "n", "v");
    ini.SetPath(m_dir.File("out.ini"));
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(ini.path), "[S]\r\nn=v\r\n\r\n");
    EXPECT_TRUE(m_reported.All().empty());
}

TEST_F(IniGuardTest, ResetLetsTheFileBeWrittenOver) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\n" + std::string(3000, 'x') + "\r\n");
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ini.Reset();
    ini.SetValue("S", "n", "v");
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\nn=v\r\n\r\n");
}

TEST_F(IniGuardTest, ReadingTheMendedFileWholeLetsItBeSaved) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\n" + std::string(3000, 'x') + "\r\n");
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    WriteBytes(fileName, "[S]\r\na=1\r\n");
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\na=1\r\n\r\n");
}

TEST_F(IniGuardTest, LineWithoutEqualsKeepsTheFile) {
    std::string fileName = m_dir.File("in.ini");
    const std::string text = "[S]\r\na=1\r\nabc\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("S", ""), "bc"); // read as ever
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(
                                      fileName, "line 3 is neither a [section] nor a name=value line")});
}

TEST_F(IniGuardTest, NameGivenTwiceKeepsTheFile) {
    std::string fileName = m_dir.File("in.ini");
    const std::string text = "[S]\r\na=1\r\n[T]\r\nb=2\r\n[S]\r\na=3\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetValue("S", "a"), "3");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{NotSaved(fileName, "line 6 repeats a name of its section")});
}

TEST_F(IniGuardTest, ANameAlreadyInTheStoreIsNoRepeat) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\r\na=1\r\n");
    CIniFile ini(fileName);
    ini.SetValue("S", "a", "0");
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\na=1\r\n\r\n");
}

TEST_F(IniGuardTest, LayoutAloneDoesNotStopASave) {
    std::string fileName = m_dir.File("in.ini");
    WriteBytes(fileName, "[S]\nb=1\n\n\n[Empty]\n[T]\r\nt=\r\n[S]\nc=2");
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\nb=1\r\nc=2\r\n\r\n[T]\r\nt=\r\n\r\n");
    EXPECT_TRUE(m_reported.All().empty());
}

TEST_F(IniGuardTest, BinaryGarbageIsReadHarmlesslyAndKept) {
    for (unsigned stream : {1u, 7u, 42u, 1234u}) {
        SCOPED_TRACE("stream " + std::to_string(stream));
        std::mt19937 rng(stream);
        std::string text(64 * 1024, '\0');
        for (char& c : text)
            c = static_cast<char>(rng() & 0xFF);
        std::string fileName = m_dir.File("garbage-" + std::to_string(stream) + ".ini");
        WriteBytes(fileName, text);
        CIniFile ini(fileName);
        ASSERT_NO_THROW(ini.ReadFile());
        ini.SetValue("CurrentPath", "Path", "C:\\x\\");
        EXPECT_FALSE(ini.WriteFile());
        EXPECT_EQ(ReadBytes(fileName), text);
    }
}

TEST_F(IniGuardTest, FolderInPlaceOfTheFileIsLeftAndSaid) {
    CIniFile ini(m_dir.Dir());
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_TRUE(std::filesystem::is_directory(m_dir.Dir()));
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(m_dir.Dir(), "it could not be read")});
}

TEST_F(IniGuardTest, FolderInPlaceOfAFileNotReadIsNotReplaced) {
    std::string folder = m_dir.File("Orvex1.ini");
    std::filesystem::create_directory(folder);
    CIniFile ini(folder);
    ini.SetValue("S", "n", "v");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_TRUE(std::filesystem::is_directory(folder));
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(folder, "a folder has its name")});
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
}

TEST_F(IniGuardTest, FileWithoutANameIsNotWritten) {
    CIniFile ini;
    ini.SetValue("S", "n", "v");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{"\nOrvex: settings were not saved: the file has no name\n"});
}

// --- numbers ---

TEST(LenientIntTest, ReadsLikeAtoiInsideTheIntRange) {
    EXPECT_EQ(LenientInt("42"), 42);
    EXPECT_EQ(LenientInt("  -17px"), -17);
    EXPECT_EQ(LenientInt("\t\r\n+8"), 8);
    EXPECT_EQ(LenientInt("abc"), 0);
    EXPECT_EQ(LenientInt(""), 0);
    EXPECT_EQ(LenientInt("- 5"), 0);
    EXPECT_EQ(LenientInt("007"), 7);
    EXPECT_EQ(LenientInt("2147483647"), INT_MAX);
    EXPECT_EQ(LenientInt("-2147483648"), INT_MIN);
}

TEST(LenientIntTest, NumbersBeyondTheRangeStopAtItsEnds) {
    EXPECT_EQ(LenientInt("2147483648"), INT_MAX);
    EXPECT_EQ(LenientInt("-2147483649"), INT_MIN);
    EXPECT_EQ(LenientInt("99999999999999999999999999999999999999"), INT_MAX);
    EXPECT_EQ(LenientInt("-99999999999999999999999999999999999999"), INT_MIN);
    EXPECT_EQ(LenientInt(std::string(3000, '9')), INT_MAX);
}

TEST_F(IniGuardTest, GetValueIKeepsHugeNumbersInRange) {
    CIniFile ini;
    ini.SetValue("S", "big", "123456789012345678901234567890");
    ini.SetValue("S", "small", "-123456789012345678901234567890");
    EXPECT_EQ(ini.GetValueI("S", "big"), INT_MAX);
    EXPECT_EQ(ini.GetValueI("S", "small"), INT_MIN);
}

// --- replacing the file ---

TEST_F(IniGuardTest, WriteLeavesNoTemporaryFile) {
    std::string fileName = m_dir.File("out.ini");
    WriteBytes(fileName, "[Old]\r\no=1\r\n");
    CIniFile ini(fileName);
    ini.SetValue("S", "n", "v");
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_TRUE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), "[S]\r\nn=v\r\n\r\n");
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"out.ini"});
}

TEST_F(IniGuardTest, TemporaryFilesLieBesideAndDifferPerProcessAndCall) {
    std::string fileName = m_dir.File("Orvex1.ini");
    std::string a = TemporaryFileBeside(fileName, 10, 1);
    std::string b = TemporaryFileBeside(fileName, 10, 2);
    std::string c = TemporaryFileBeside(fileName, 11, 1);
    EXPECT_NE(a, b);
    EXPECT_NE(a, c);
    EXPECT_NE(b, c);
    EXPECT_NE(a, fileName);
    EXPECT_EQ(std::filesystem::path(a).parent_path(), std::filesystem::path(fileName).parent_path());
}

TEST_F(IniGuardTest, ReadOnlyFileIsNotReplaced) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=1\r\n\r\n";
    WriteBytes(fileName, text);
    MakeReadOnly(fileName, true);
    CIniFile ini(fileName);
    EXPECT_TRUE(ini.ReadFile());
    ini.SetValue("View", "Sort", "2");
    EXPECT_FALSE(ini.WriteFile());
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(), std::vector<std::string>{NotSaved(fileName, "it is read-only")});
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
    MakeReadOnly(fileName, false);
}

TEST_F(IniGuardTest, FileInAMissingFolderIsNotWrittenAndSaid) {
    CIniFile ini(m_dir.File("no-such-folder/out.ini"));
    ini.SetValue("S", "n", "v");
    EXPECT_FALSE(ini.WriteFile());
    ASSERT_EQ(m_reported.Texts().size(), 1u);
    EXPECT_EQ(m_reported.Texts()[0].rfind(
                  "\nOrvex: " + ini.path + " was not saved: no file can be made in its folder", 0),
              0u)
        << m_reported.Texts()[0];
    EXPECT_FALSE(FileExists(ini.path));
}

#ifndef _WIN32
// A write that fails part-way (here: the process may not make files larger than 4 KiB) leaves the old
// file and no temporary one.
TEST_F(IniGuardTest, FailedWriteLeavesTheOldFile) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[S]\r\nold=1\r\n\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    for (int i = 0; i < 100; ++i)
        ini.SetValue("S", "n" + std::to_string(i), std::string(200, 'v'));

    struct rlimit saved;
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &saved), 0);
    auto previousHandler = std::signal(SIGXFSZ, SIG_IGN);
    struct rlimit small = saved;
    small.rlim_cur = 4096;
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &small), 0);
    const bool written = ini.WriteFile();
    ::setrlimit(RLIMIT_FSIZE, &saved);
    std::signal(SIGXFSZ, previousHandler);

    EXPECT_FALSE(written);
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
    ASSERT_EQ(m_reported.Texts().size(), 1u);
    EXPECT_EQ(m_reported.Texts()[0].rfind("\nOrvex: " + fileName + " was not saved: writing failed: ", 0), 0u)
        << m_reported.Texts()[0];
}

TEST_F(IniGuardTest, AFullDiskLeavesTheOldFileAndSaysSo) {
    std::string fileName = m_dir.File("datains.ini");
    const std::string text = "[Default Parameters]\r\nLayer=DOORS\r\nLisp command=(c:go)\r\nColor=5\r\n\r\n";
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ini.SetValue("Default Parameters", "Layer", "WALLS");
    SetDiskRoomForTesting(16);
    const bool written = ini.WriteFile();
    SetDiskRoomForTesting(-1);
    EXPECT_FALSE(written);
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"datains.ini"});
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{"\nOrvex: " + fileName +
                                       " was not saved: the disk is full; the file is left as it was\n"});
    EXPECT_TRUE(ini.WriteFile()) << "with room again the save goes through";
    EXPECT_NE(ReadBytes(fileName).find("Layer=WALLS\r\n"), std::string::npos);
}

TEST_F(IniGuardTest, ReplacedFileKeepsItsPermissions) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[S]\r\na=1\r\n");
    ASSERT_EQ(::chmod(fileName.c_str(), 0640), 0);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    ASSERT_TRUE(ini.WriteFile());
    struct stat st;
    ASSERT_EQ(::stat(fileName.c_str(), &st), 0);
    EXPECT_EQ(st.st_mode & 07777, 0640u);
}

TEST_F(IniGuardTest, PipeInPlaceOfTheFileDoesNotHang) {
    std::string fileName = m_dir.File("Orvex1.ini");
    ASSERT_EQ(::mkfifo(fileName.c_str(), 0644), 0);
    CIniFile ini(fileName);
    EXPECT_FALSE(ini.ReadFile());
    EXPECT_EQ(ini.error, "Unable to open ini file.");
}
#endif

// --- writers at the same moment ---

namespace {

// The bytes WriteFile makes of the tagged store.
std::string TaggedBytes(const TempFolder& dir, const std::string& tag) {
    CIniFile ini(dir.File("expected-" + tag + ".ini"));
    FillTaggedStore(ini, tag);
    EXPECT_TRUE(ini.WriteFile());
    std::string bytes = ReadBytes(ini.path);
    std::filesystem::remove(ini.path);
    return bytes;
}

} // namespace

TEST_F(IniGuardTest, TwoWritersAtOnceLeaveOneWholeFile) {
    const std::string a = TaggedBytes(m_dir, "A");
    const std::string b = TaggedBytes(m_dir, "B");
    ASSERT_NE(a, b);
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, a);

    std::atomic<bool> writing{true};
    std::atomic<int> saved{0};
    std::atomic<int> mixed{0};
    auto writer = [&](const std::string& tag) {
        CIniFile ini(fileName);
        FillTaggedStore(ini, tag);
        for (int i = 0; i < 60; ++i)
            saved += ini.WriteFile() ? 1 : 0;
    };
    // A reader meanwhile never sees a cut or mixed file.
    std::thread reader([&] {
        while (writing) {
            std::string bytes;
            if (ReadWholeFile(fileName, kMaxIniFileBytes, bytes) == WholeFileRead::Read && bytes != a &&
                bytes != b)
                ++mixed;
        }
    });
    std::thread first(writer, "A");
    std::thread second(writer, "B");
    first.join();
    second.join();
    writing = false;
    reader.join();

    EXPECT_EQ(mixed, 0);
    EXPECT_GT(saved, 0);
    const std::string result = ReadBytes(fileName);
    EXPECT_TRUE(result == a || result == b) << result.size() << " bytes";
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
}

#ifndef _WIN32
TEST_F(IniGuardTest, TwoProcessesAtOnceLeaveOneWholeFile) {
    const std::string a = TaggedBytes(m_dir, "A");
    const std::string b = TaggedBytes(m_dir, "B");
    std::string fileName = m_dir.File("Orvex1.ini");
    auto writeMany = [&](const std::string& tag) {
        CIniFile ini(fileName);
        FillTaggedStore(ini, tag);
        int saved = 0;
        for (int i = 0; i < 60; ++i)
            saved += ini.WriteFile() ? 1 : 0;
        return saved;
    };
    pid_t child = ::fork();
    ASSERT_GE(child, 0);
    if (child == 0)
        ::_exit(writeMany("B") > 0 ? 0 : 1);
    EXPECT_GT(writeMany("A"), 0);
    int status = 0;
    ASSERT_EQ(::waitpid(child, &status, 0), child);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
    const std::string result = ReadBytes(fileName);
    EXPECT_TRUE(result == a || result == b) << result.size() << " bytes";
    EXPECT_EQ(FilesIn(m_dir.Dir()), std::vector<std::string>{"Orvex1.ini"});
}
#endif

// --- the look-up index ---

namespace {

// The store as the plain searches of old would see it.
struct ModelStore {
    std::vector<std::pair<std::string, std::vector<std::pair<std::string, std::string>>>> sections;

    int FindKey(const std::string& name) const {
        for (std::size_t k = 0; k < sections.size(); ++k) {
            if (sections[k].first == name)
                return static_cast<int>(k);
        }
        return -1;
    }
    int FindValue(int k, const std::string& name) const {
        if (k == -1)
            return -1;
        const auto& values = sections[static_cast<std::size_t>(k)].second;
        for (std::size_t j = 0; j < values.size(); ++j) {
            if (values[j].first == name)
                return static_cast<int>(j);
        }
        return -1;
    }
    bool SetValue(const std::string& key, const std::string& name, const std::string& value, bool create) {
        int k = FindKey(key);
        if (k == -1) {
            if (!create)
                return false;
            sections.push_back({key, {}});
            k = static_cast<int>(sections.size()) - 1;
        }
        int j = FindValue(k, name);
        auto& values = sections[static_cast<std::size_t>(k)].second;
        if (j == -1) {
            if (!create)
                return false;
            values.push_back({name, ""});
            j = static_cast<int>(values.size()) - 1;
        }
        values[static_cast<std::size_t>(j)].second = value;
        return true;
    }
};

} // namespace

TEST_F(IniGuardTest, IndexFollowsEveryChange) {
    const std::vector<std::string> keyNames = {"", "A", "a", "B", "Size", "View", " A", "A "};
    const std::vector<std::string> valueNames = {"", "x", "X", "y", "Path", "path", "Sort", "z "};
    for (unsigned stream = 1; stream <= 20; ++stream) {
        SCOPED_TRACE("stream " + std::to_string(stream));
        std::mt19937 rng(stream);
        auto pick = [&](const std::vector<std::string>& pool) {
            return pool[std::uniform_int_distribution<std::size_t>(0, pool.size() - 1)(rng)];
        };
        CIniFile ini;
        ModelStore model;
        for (int step = 0; step < 400; ++step) {
            const std::string key = pick(keyNames);
            const std::string name = pick(valueNames);
            switch (std::uniform_int_distribution<int>(0, 19)(rng)) {
            case 0: {
                const int k = model.FindKey(key);
                EXPECT_EQ(ini.DeleteKey(key), k != -1);
                if (k != -1)
                    model.sections.erase(model.sections.begin() + k);
                break;
            }
            case 1:
            case 2:
            case 3: {
                const int k = model.FindKey(key);
                const int j = model.FindValue(k, name);
                EXPECT_EQ(ini.DeleteValue(key, name), j != -1);
                if (j != -1)
                    model.sections[static_cast<std::size_t>(k)].second.erase(
                        model.sections[static_cast<std::size_t>(k)].second.begin() + j);
                break;
            }
            case 4:
                if (std::uniform_int_distribution<int>(0, 9)(rng) == 0) {
                    ini.Reset();
                    model.sections.clear();
                }
                break;
            default: {
                const bool create = std::uniform_int_distribution<int>(0, 4)(rng) != 0;
                const std::string value = std::to_string(step);
                EXPECT_EQ(ini.SetValue(key, name, value, create), model.SetValue(key, name, value, create));
                break;
            }
            }
            ASSERT_EQ(ini.GetNumKeys(), static_cast<int>(model.sections.size()));
            for (const std::string& k : keyNames) {
                const int keynum = model.FindKey(k);
                ASSERT_EQ(ini.FindKey(k), keynum) << "step " << step << " key '" << k << "'";
                for (const std::string& v : valueNames)
                    ASSERT_EQ(ini.FindValue(keynum, v), model.FindValue(keynum, v))
                        << "step " << step << " key '" << k << "' value '" << v << "'";
            }
            for (std::size_t k = 0; k < model.sections.size(); ++k) {
                ASSERT_EQ(ini.names[static_cast<int>(k)], model.sections[k].first);
                for (const auto& pair : model.sections[k].second)
                    ASSERT_EQ(ini.GetValue(model.sections[k].first, pair.first), pair.second);
            }
        }
    }
}

TEST_F(IniGuardTest, IndexNoticesArraysChangedDirectly) {
    CIniFile ini;
    ini.SetValue("A", "x", "1");
    // An element appended around the member functions is found...
    ini.keys.SetSize(2);
    ini.names.SetSize(2);
    ini.names[1] = "B";
    EXPECT_EQ(ini.FindKey("B"), 1);
    // ...and a renamed one is no longer found under its old name.
    ini.names[0] = "Renamed";
    EXPECT_EQ(ini.FindKey("A"), -1);
    EXPECT_EQ(ini.FindKey("Renamed"), 0);
    ini.keys[0].names[0] = "y";
    EXPECT_EQ(ini.FindValue(0, "x"), -1);
    EXPECT_EQ(ini.FindValue(0, "y"), 0);
}

TEST_F(IniGuardTest, ManyKeysAreAllFound) {
    std::string fileName = m_dir.File("many.ini");
    std::string text = "[S]\r\n";
    for (int i = 0; i < 60000; ++i)
        text += "k" + std::to_string(i) + "=" + std::to_string(i) + "\r\n";
    for (int i = 0; i < 5000; ++i)
        text += "[T" + std::to_string(i) + "]\r\nv=" + std::to_string(i) + "\r\n";
    ASSERT_LE(text.size(), kMaxIniFileBytes);
    WriteBytes(fileName, text);
    CIniFile ini(fileName);
    ASSERT_TRUE(ini.ReadFile());
    EXPECT_EQ(ini.GetNumValues("S"), 60000);
    EXPECT_EQ(ini.GetNumKeys(), 5001);
    EXPECT_EQ(ini.FindValue(0, "k59999"), 59999);
    EXPECT_EQ(ini.GetValue("S", "k54321"), "54321");
    EXPECT_EQ(ini.FindKey("T4999"), 5000);
    EXPECT_EQ(ini.GetValue("T777", "v"), "777");
    EXPECT_TRUE(ini.WriteFile());
    CIniFile back(fileName);
    ASSERT_TRUE(back.ReadFile());
    EXPECT_EQ(back.GetNumValues("S"), 60000);
    EXPECT_EQ(back.GetNumKeys(), 5001);
}
