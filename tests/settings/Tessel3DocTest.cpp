#include "settings/Tessel3Doc.h"

#include "settings/SettingsPath.h"

#include "TempDir.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <memory>
#include <string>

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
    TempDir m_dir;
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

TEST_F(Tessel3DocTest, ConstructorRecordsTheDocumentAndDestructorLeavesIt) {
    g_pTessel3Doc = nullptr;
    auto doc = std::make_unique<CTessel3Doc>(m_dir.File("Orvex1.ini"));
    CTessel3Doc* address = doc.get();
    EXPECT_EQ(g_pTessel3Doc, address);
    auto second = std::make_unique<CTessel3Doc>(m_dir.File("Other.ini"));
    EXPECT_EQ(g_pTessel3Doc, second.get());
    second.reset();
    doc.reset();
    EXPECT_NE(g_pTessel3Doc, nullptr);
    g_pTessel3Doc = nullptr;
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
        EXPECT_NO_THROW(doc.reset());
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
        EXPECT_NO_THROW(doc.reset());
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
