#include "settings/Tessel3Doc.h"

#include "settings/SettingsPath.h"

#include "ReportedMessages.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <climits>
#include <filesystem>
#include <memory>
#include <random>
#include <string>
#include <vector>

using namespace testsupport; // TempFolder and the whole-file helpers

namespace {

const char kFreshFile[] = "[CurrentPath]\r\n"
                          "Path=\r\n"
                          "Name=\r\n"
                          "ShellPath=\r\n"
                          "\r\n"
                          "[Size]\r\n"
                          "SplitterSize=100\r\n"
                          "WindowWidth=0\r\n"
                          "WindowHeight=0\r\n"
                          "\r\n"
                          "[View]\r\n"
                          "PictureWidth=0\r\n"
                          "PictureHeight=0\r\n"
                          "Sort=0\r\n"
                          "\r\n";

void ExpectDefaults(const CTessel3Doc& doc) {
    EXPECT_EQ(doc.m_strPath, "");
    EXPECT_EQ(doc.m_strName, "");
    EXPECT_EQ(doc.m_strShellPath, "");
    EXPECT_EQ(doc.m_nSplitterSize, 100);
    EXPECT_EQ(doc.m_nWindowWidth, 0);
    EXPECT_EQ(doc.m_nWindowHeight, 0);
    EXPECT_EQ(doc.m_nPictureWidth, 0);
    EXPECT_EQ(doc.m_nPictureHeight, 0);
    EXPECT_EQ(doc.m_nSort, 0);
}

class Tessel3DocTest : public ::testing::Test {
protected:
    TempFolder m_dir;
};

} // namespace

TEST_F(Tessel3DocTest, FirstRunStartsWithDefaultsAndWritesTheFreshFile) {
    std::string fileName = m_dir.File("Orvex1.ini");
    {
        CTessel3Doc doc(fileName);
        ExpectDefaults(doc);
        EXPECT_EQ(doc.m_IniFile.path, fileName);
        EXPECT_FALSE(FileExists(fileName)); // nothing is written before the document goes
    }
    EXPECT_EQ(ReadBytes(fileName), kFreshFile);
}

TEST_F(Tessel3DocTest, ConstructorRecordsTheDocumentAndDestructorClearsIt) {
    g_pTessel3Doc = nullptr;
    auto doc = std::make_unique<CTessel3Doc>(m_dir.File("Orvex1.ini"));
    CTessel3Doc* address = doc.get();
    EXPECT_EQ(g_pTessel3Doc, address);
    auto second = std::make_unique<CTessel3Doc>(m_dir.File("Other.ini"));
    EXPECT_EQ(g_pTessel3Doc, second.get());
    second.reset();
    EXPECT_EQ(g_pTessel3Doc, nullptr) << "no pointer to a document that is gone";
    g_pTessel3Doc = address;
    doc.reset();
    EXPECT_EQ(g_pTessel3Doc, nullptr);
}

TEST_F(Tessel3DocTest, LoadsAllNineSettings) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[CurrentPath]\r\nPath=C:\\dwg\\\r\nName=a.dwg\r\nShellPath=Desktop\\C:\\dwg\r\n\r\n"
                         "[Size]\r\nSplitterSize=250\r\nWindowWidth=800\r\nWindowHeight=600\r\n\r\n"
                         "[View]\r\nPictureWidth=120\r\nPictureHeight=90\r\nSort=2\r\n\r\n");
    CTessel3Doc doc(fileName);
    EXPECT_EQ(doc.m_strPath, "C:\\dwg\\");
    EXPECT_EQ(doc.m_strName, "a.dwg");
    EXPECT_EQ(doc.m_strShellPath, "Desktop\\C:\\dwg");
    EXPECT_EQ(doc.m_nSplitterSize, 250);
    EXPECT_EQ(doc.m_nWindowWidth, 800);
    EXPECT_EQ(doc.m_nWindowHeight, 600);
    EXPECT_EQ(doc.m_nPictureWidth, 120);
    EXPECT_EQ(doc.m_nPictureHeight, 90);
    EXPECT_EQ(doc.m_nSort, 2);
}

TEST_F(Tessel3DocTest, ZeroSplitterBecomes100AndActualWidthIsSaved) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[Size]\r\nSplitterSize=0\r\n");
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nSplitterSize, 100);
        doc.m_nSplitterSize = 180;
    }
    CTessel3Doc again(fileName);
    EXPECT_EQ(again.m_nSplitterSize, 180);
}

TEST_F(Tessel3DocTest, UnreadableNumbersBecomeZero) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[Size]\r\nSplitterSize=wide\r\nWindowWidth= 640px\r\nWindowHeight=-5\r\n"
                         "[View]\r\nPictureWidth=\r\nSort=x1\r\n");
    CTessel3Doc doc(fileName);
    EXPECT_EQ(doc.m_nSplitterSize, 100);
    EXPECT_EQ(doc.m_nWindowWidth, 640);
    EXPECT_EQ(doc.m_nWindowHeight, -5); // no range is checked
    EXPECT_EQ(doc.m_nPictureWidth, 0);
    EXPECT_EQ(doc.m_nSort, 0);
}

TEST_F(Tessel3DocTest, UnknownSectionsAndKeysSurviveInPlace) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[Other]\r\nx=1\r\n\r\n"
                         "[View]\r\nSort=1\r\nZoom=3\r\nPictureHeight=80\r\nPictureWidth=100\r\n\r\n"
                         "[CurrentPath]\r\nShellPath=s\r\nExtra=e\r\nPath=p\r\nName=n\r\n\r\n"
                         "[Size]\r\nWindowHeight=2\r\nWindowWidth=1\r\nSplitterSize=9\r\n\r\n"
                         "[Tail]\r\ny=2\r\n\r\n");
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_strPath, "p");
        EXPECT_EQ(doc.m_nPictureHeight, 80);
        doc.m_strPath = "C:\\new\\";
        doc.m_nSort = 2;
        doc.m_nWindowWidth = 1024;
    }
    EXPECT_EQ(ReadBytes(fileName),
              "[Other]\r\nx=1\r\n\r\n"
              "[View]\r\nSort=2\r\nZoom=3\r\nPictureHeight=80\r\nPictureWidth=100\r\n\r\n"
              "[CurrentPath]\r\nShellPath=s\r\nExtra=e\r\nPath=C:\\new\\\r\nName=n\r\n\r\n"
              "[Size]\r\nWindowHeight=2\r\nWindowWidth=1024\r\nSplitterSize=9\r\n\r\n"
              "[Tail]\r\ny=2\r\n\r\n");
}

TEST_F(Tessel3DocTest, MissingKeysAreAppendedAndMissingSectionsFollowInOrder) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[View]\r\nSort=1\r\n\r\n[Size]\r\nWindowWidth=700\r\n\r\n");
    { CTessel3Doc doc(fileName); }
    EXPECT_EQ(ReadBytes(fileName), "[View]\r\nSort=1\r\nPictureWidth=0\r\nPictureHeight=0\r\n\r\n"
                                   "[Size]\r\nWindowWidth=700\r\nSplitterSize=100\r\nWindowHeight=0\r\n\r\n"
                                   "[CurrentPath]\r\nPath=\r\nName=\r\nShellPath=\r\n\r\n");
}

TEST_F(Tessel3DocTest, KeysAreCaseSensitive) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, "[CurrentPath]\r\npath=C:\\lower\\\r\n");
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_strPath, "");
        doc.m_strPath = "C:\\upper\\";
    }
    EXPECT_EQ(ReadBytes(fileName), std::string("[CurrentPath]\r\npath=C:\\lower\\\r\nPath=C:\\upper\\\r\n"
                                               "Name=\r\nShellPath=\r\n\r\n") +
                                       (kFreshFile + std::string(kFreshFile).find("[Size]")));
}

TEST_F(Tessel3DocTest, DirectoryInPlaceOfTheFileIsPassedOver) {
    std::string fileName = m_dir.File("Orvex1.ini");
    std::filesystem::create_directory(fileName);
    {
        std::unique_ptr<CTessel3Doc> doc;
        ASSERT_NO_THROW(doc = std::make_unique<CTessel3Doc>(fileName));
        ExpectDefaults(*doc);
        doc->m_nSort = 1;
        doc.reset(); // the close writes, or passes over the file: what it did is checked below
    }
    EXPECT_TRUE(std::filesystem::is_directory(fileName));
}

TEST_F(Tessel3DocTest, UnwritableFileIsPassedOver) {
    std::string fileName = m_dir.File("missing-folder/Orvex1.ini");
    {
        std::unique_ptr<CTessel3Doc> doc;
        ASSERT_NO_THROW(doc = std::make_unique<CTessel3Doc>(fileName));
        ExpectDefaults(*doc);
        doc->m_strPath = "C:\\x\\";
        doc.reset(); // the close writes, or passes over the file: what it did is checked below
    }
    EXPECT_FALSE(FileExists(fileName));
}

TEST_F(Tessel3DocTest, SettingsRoundTrip) {
    std::string fileName = m_dir.File("Orvex1.ini");
    {
        CTessel3Doc doc(fileName);
        doc.m_strPath = "C:\\Drawings\\Parts\\";
        doc.m_strName = "bolt m8 = long.dwg";
        doc.m_strShellPath = "Desktop\\This PC\\Local Disk (C:)\\Drawings\\Parts";
        doc.m_nSplitterSize = 321;
        doc.m_nWindowWidth = 1280;
        doc.m_nWindowHeight = 960;
        doc.m_nPictureWidth = 150;
        doc.m_nPictureHeight = 110;
        doc.m_nSort = 1;
    }
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_strPath, "C:\\Drawings\\Parts\\");
        EXPECT_EQ(doc.m_strName, "bolt m8 = long.dwg");
        EXPECT_EQ(doc.m_strShellPath, "Desktop\\This PC\\Local Disk (C:)\\Drawings\\Parts");
        EXPECT_EQ(doc.m_nSplitterSize, 321);
        EXPECT_EQ(doc.m_nWindowWidth, 1280);
        EXPECT_EQ(doc.m_nWindowHeight, 960);
        EXPECT_EQ(doc.m_nPictureWidth, 150);
        EXPECT_EQ(doc.m_nPictureHeight, 110);
        EXPECT_EQ(doc.m_nSort, 1);
    }
    // Saving unchanged settings leaves the file as it is.
    std::string before = ReadBytes(fileName);
    { CTessel3Doc doc(fileName); }
    EXPECT_EQ(ReadBytes(fileName), before);
}

TEST_F(Tessel3DocTest, DefaultConstructorUsesTheSettingsFileBesideTheModule) {
    // Beside the test program (or in its working directory natively): a file left by an earlier run
    // of this test is removed first.
    std::string fileName = ExplorerSettingsPath();
    std::error_code ec;
    std::filesystem::remove(fileName, ec);
    {
        CTessel3Doc doc;
        EXPECT_EQ(doc.m_IniFile.path, fileName);
        ExpectDefaults(doc);
    }
    EXPECT_EQ(ReadBytes(fileName), kFreshFile);
    std::filesystem::remove(fileName, ec);
}

// --- settings files a careless or hostile user could leave ---

namespace {

class Tessel3DocGuardTest : public Tessel3DocTest {
protected:
    // The document reads the file and is closed with changed settings; the file must come out as it
    // went in, and the reporter must have said so once.
    void ExpectSurvivesAClose(const std::string& text, const std::string& why) {
        std::string fileName = m_dir.File("Orvex1.ini");
        WriteBytes(fileName, text);
        {
            std::unique_ptr<CTessel3Doc> doc;
            ASSERT_NO_THROW(doc = std::make_unique<CTessel3Doc>(fileName));
            doc->m_strPath = "C:\\changed\\";
            doc->m_nSort = 2;
            doc.reset(); // the close writes, or passes over the file: what it did is checked below
        }
        EXPECT_EQ(ReadBytes(fileName), text);
        const std::vector<std::string> texts = m_reported.Texts();
        ASSERT_FALSE(texts.empty());
        EXPECT_EQ(texts.back(),
                  "\nOrvex: " + fileName + " was not saved: " + why + "; the file is left as it was\n");
    }

    ReportedMessages m_reported;
};

} // namespace

TEST_F(Tessel3DocGuardTest, LineOf3000CharactersSurvivesAClose) {
    ExpectSurvivesAClose("[CurrentPath]\r\nPath=C:\\dwg\\\r\nName=" + std::string(3000, 'n') +
                             "\r\n\r\n[View]\r\nSort=1\r\n",
                         "line 3 is longer than 2047 characters");
}

TEST_F(Tessel3DocGuardTest, BinaryGarbageSurvivesAClose) {
    std::mt19937 rng(2024);
    std::string text(20000, '\0');
    for (char& c : text)
        c = static_cast<char>(rng() & 0xFF);
    text = "[View]\r\nSort=1\r\n" + text;
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, text);
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nSort, 1); // what could be read is used
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    ASSERT_EQ(m_reported.Texts().size(), 1u);
    EXPECT_NE(m_reported.Texts()[0].find(" was not saved: line "), std::string::npos)
        << m_reported.Texts()[0];
}

TEST_F(Tessel3DocGuardTest, OverSizeFileGivesDefaultsAndSurvivesAClose) {
    std::string text = "[View]\r\nSort=2\r\n[Filler]\r\n";
    for (int i = 0; text.size() <= kMaxIniFileBytes; ++i)
        text += "f" + std::to_string(i) + "=" + std::string(40, 'x') + "\r\n";
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName, text);
    {
        CTessel3Doc doc(fileName);
        ExpectDefaults(doc);
        doc.m_nSort = 1;
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(),
              (std::vector<std::string>{
                  "\nOrvex: " + fileName + " is larger than 1 MiB; it was not read\n",
                  "\nOrvex: " + fileName +
                      " was not saved: it is larger than 1 MiB; the file is left as it was\n"}));
}

TEST_F(Tessel3DocGuardTest, ReadOnlyFileIsUsedAndLeftAsItWas) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[View]\r\nSort=2\r\n\r\n";
    WriteBytes(fileName, text);
    std::filesystem::permissions(fileName,
                                 std::filesystem::perms::owner_write | std::filesystem::perms::group_write |
                                     std::filesystem::perms::others_write,
                                 std::filesystem::perm_options::remove);
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nSort, 2);
        doc.m_nSort = 0;
    }
    EXPECT_EQ(ReadBytes(fileName), text);
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{"\nOrvex: " + fileName +
                                       " was not saved: it is read-only; the file is left as it was\n"});
    std::filesystem::permissions(fileName, std::filesystem::perms::owner_write,
                                 std::filesystem::perm_options::add);
}

TEST_F(Tessel3DocGuardTest, HugeAndNegativeNumbersStayInsideTheIntRange) {
    std::string fileName = m_dir.File("Orvex1.ini");
    WriteBytes(fileName,
               "[Size]\r\nSplitterSize=99999999999999999999\r\nWindowWidth=-99999999999999999999\r\n"
               "WindowHeight=-1\r\n\r\n[View]\r\nPictureWidth=2147483648\r\nPictureHeight=-2147483648\r\n"
               "Sort=-7\r\n\r\n");
    CTessel3Doc doc(fileName);
    EXPECT_EQ(doc.m_nSplitterSize, INT_MAX);
    EXPECT_EQ(doc.m_nWindowWidth, INT_MIN);
    EXPECT_EQ(doc.m_nWindowHeight, -1);
    EXPECT_EQ(doc.m_nPictureWidth, INT_MAX);
    EXPECT_EQ(doc.m_nPictureHeight, INT_MIN);
    EXPECT_EQ(doc.m_nSort, -7);
}

TEST_F(Tessel3DocGuardTest, NoSettingsFileNameGivesDefaultsAndSavesNothing) {
    const auto before = std::filesystem::current_path();
    {
        CTessel3Doc doc{std::string()};
        ExpectDefaults(doc);
        doc.m_nSort = 1;
    }
    EXPECT_TRUE(m_reported.All().empty());
    EXPECT_EQ(std::filesystem::current_path(), before);
}

#ifndef _WIN32
// Natively the settings file lies in the current directory: one too deep for the 260-character name
// is refused with an alert, and the explorer runs on defaults and writes nothing there.
TEST_F(Tessel3DocGuardTest, TooLongAFolderGivesDefaultsAnAlertAndNoFile) {
    std::filesystem::path deep = m_dir.Dir();
    while (deep.string().size() < 300)
        deep /= "a-rather-long-folder-name";
    std::filesystem::create_directories(deep);
    const auto before = std::filesystem::current_path();
    std::filesystem::current_path(deep);
    {
        CTessel3Doc doc;
        ExpectDefaults(doc);
        EXPECT_EQ(doc.m_IniFile.path, "");
        doc.m_nSort = 2;
    }
    std::filesystem::current_path(before);
    EXPECT_TRUE(std::filesystem::is_empty(deep));
    const std::vector<ReportedMessage> messages = m_reported.All();
    ASSERT_EQ(messages.size(), 1u);
    EXPECT_TRUE(messages[0].alert);
    EXPECT_EQ(messages[0].text.rfind("\nOrvex: the library's folder is too long for its settings file (", 0),
              0u)
        << messages[0].text;
}
#endif

TEST_F(Tessel3DocGuardTest, AFolderWithALineBreakIsNeverWrittenAndLaterClosesStillSave) {
    std::string fileName = m_dir.File("Orvex1.ini");
    const std::string text = "[CurrentPath]\r\nPath=Z:\\dwg\\\r\n\r\n[Size]\r\nWindowWidth=900\r\n\r\n";
    WriteBytes(fileName, text);
    {
        CTessel3Doc doc(fileName);
        doc.m_strPath = "Z:\\a\r\n[View]\r\nb\\";
        doc.m_nWindowWidth = 800;
    }
    EXPECT_EQ(ReadBytes(fileName), text) << "no [View] section made of a folder name";
    EXPECT_EQ(m_reported.Texts(),
              std::vector<std::string>{"\nOrvex: " + fileName +
                                       " was not saved: the value of Path holds a line break in "
                                       "[CurrentPath]; the file is left as it was\n"});
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_strPath, "Z:\\dwg\\");
        doc.m_nWindowWidth = 700;
    }
    EXPECT_NE(ReadBytes(fileName).find("WindowWidth=700\r\n"), std::string::npos)
        << "the next close saves: nothing is frozen";
}

TEST_F(Tessel3DocTest, ThePictureCacheBoundIsReadInMiBAndKeptAsWritten) {
    const std::string fileName = m_dir.File("Orvex1.ini");
    EXPECT_EQ(CTessel3Doc(m_dir.File("none.ini")).m_nPictureCacheMiB, 64);
    const std::string text = "[View]\r\nPictureCacheMiB=200\r\n";
    WriteBytes(fileName, text);
    {
        CTessel3Doc doc(fileName);
        EXPECT_EQ(doc.m_nPictureCacheMiB, 200);
    }
    EXPECT_NE(ReadBytes(fileName).find("PictureCacheMiB=200\r\n"), std::string::npos)
        << "the key survives the save";
    for (const char* refused : {"0", "-5", "1025", "lots"}) {
        WriteBytes(fileName, std::string("[View]\r\nPictureCacheMiB=") + refused + "\r\n");
        EXPECT_EQ(CTessel3Doc(fileName).m_nPictureCacheMiB, 64) << refused;
    }
}
