#include "thumbs/DrawingFolder.h"

#include "settings/Tessel3Doc.h"

#include <gtest/gtest.h>

#include <algorithm>

#include <map>
#include <memory>
#include <new>
#include <string>
#include <vector>

namespace {

// Folders held in memory: what each lists, and where the current directory went.
struct MemoryReader : FolderReader {
    std::map<std::string, std::vector<DwgData>> folders;
    std::map<std::string, std::string> problems;
    std::vector<std::string> reads;
    std::vector<std::string> currentDirectories;

    bool Read(const std::string& folder, std::vector<DwgData>& drawings, std::string& problem,
              ScanProgress& progress) override {
        reads.push_back(folder);
        if (auto said = problems.find(folder); said != problems.end())
            problem = said->second;
        const auto found = folders.find(folder);
        if (found == folders.end())
            return false;
        drawings = found->second;
        return true;
    }
    void MakeCurrentDirectory(const std::string& folder) override { currentDirectories.push_back(folder); }
};

DwgData Drawing(const std::string& name, std::int64_t time = 0, std::uint64_t size = 0) {
    DwgFindEntry entry;
    entry.name = name;
    entry.timeWrite = time;
    entry.size = size;
    return DwgData(entry);
}

class DrawingFolderTest : public ::testing::Test {
protected:
    void SetUp() override {
        reader.folders["C:\\dwg"] = {Drawing("c.dwg", 3, 30), Drawing("a.dwg", 1, 10),
                                     Drawing("b.dwg", 2, 20)};
        reader.folders["C:\\"] = {Drawing("root.dwg")};
        reader.folders["\\\\server\\share\\dir"] = {Drawing("net.dwg")};
        folder.onShown = [this] { ++shown; };
        folder.onChosen = [this] { ++chosen; };
    }
    void TearDown() override { BeginScan(); }

    MemoryReader reader;
    CTessel3Doc doc{std::string()};
    DrawingFolder folder{reader, &doc};
    int shown = 0;
    int chosen = 0;
};

} // namespace

TEST(DrawingFolderSpelling, AFolderHasNoSeparatorAtItsEndWithOrWithoutOneGiven) {
    EXPECT_EQ(DrawingFolder::Spelling("C:\\dwg"), "C:\\dwg");
    EXPECT_EQ(DrawingFolder::Spelling("C:\\dwg\\"), "C:\\dwg");
    EXPECT_EQ(DrawingFolder::Spelling("C:\\dwg\\\\"), "C:\\dwg");
    EXPECT_EQ(DrawingFolder::Spelling("C:/dwg/doors/"), "C:/dwg/doors");
}

TEST(DrawingFolderSpelling, ADriveRootKeepsItsSeparator) {
    EXPECT_EQ(DrawingFolder::Spelling("C:\\"), "C:\\");
    EXPECT_EQ(DrawingFolder::Spelling("C:"), "C:\\");
    EXPECT_EQ(DrawingFolder::Spelling("C:\\\\"), "C:\\");
    EXPECT_EQ(DrawingFolder::Spelling("z:/"), "z:/");
}

TEST(DrawingFolderSpelling, ANetworkShareIsSpelledLikeAFolderAndItsRootKeepsItsSeparator) {
    EXPECT_EQ(DrawingFolder::Spelling("\\\\server\\share\\dir"), "\\\\server\\share\\dir");
    EXPECT_EQ(DrawingFolder::Spelling("\\\\server\\share\\dir\\"), "\\\\server\\share\\dir");
    EXPECT_EQ(DrawingFolder::Spelling("\\\\server\\share"), "\\\\server\\share\\");
    EXPECT_EQ(DrawingFolder::Spelling("\\\\server\\share\\"), "\\\\server\\share\\");
    EXPECT_EQ(DrawingFolder::Spelling(""), "");
}

TEST(DrawingFolderJoin, AFolderAndANameMakeOnePathWithOneSeparator) {
    EXPECT_EQ(DrawingFolder::Join("C:\\dwg", "a.dwg"), "C:\\dwg\\a.dwg");
    EXPECT_EQ(DrawingFolder::Join("C:\\", "a.dwg"), "C:\\a.dwg");
    EXPECT_EQ(DrawingFolder::Join("\\\\server\\share\\", "a.dwg"), "\\\\server\\share\\a.dwg");
    EXPECT_EQ(DrawingFolder::Join("\\\\server\\share\\dir", "a.dwg"), "\\\\server\\share\\dir\\a.dwg");
}

TEST_F(DrawingFolderTest, ShowReadsTheFolderInItsOneSpellingAndMakesItCurrentAndTheDocuments) {
    EXPECT_TRUE(folder.Show("C:\\dwg\\"));
    EXPECT_EQ(folder.Folder(), "C:\\dwg");
    EXPECT_EQ(reader.reads, std::vector<std::string>{"C:\\dwg"});
    EXPECT_EQ(reader.currentDirectories, std::vector<std::string>{"C:\\dwg"});
    EXPECT_EQ(doc.m_strPath, "C:\\dwg");
    ASSERT_EQ(folder.Count(), 3);
    EXPECT_EQ(folder.Drawing(0).m_strName, "c.dwg"); // the file system's order until sorted
    EXPECT_EQ(shown, 1);
}

TEST_F(DrawingFolderTest, ShowFillsTheOneListOfTheProcess) {
    folder.Show("C:\\dwg");
    ASSERT_EQ(DwgList.GetSize(), 3);
    EXPECT_EQ(DwgList[1].m_strName, "a.dwg");
}

TEST_F(DrawingFolderTest, ADriveRootAndANetworkFolderAreShownAndJoinedRightly) {
    folder.Show("C:");
    EXPECT_EQ(folder.Folder(), "C:\\");
    folder.Choose(0);
    EXPECT_EQ(folder.ChosenPath(), "C:\\root.dwg");
    folder.Show("\\\\server\\share\\dir\\");
    EXPECT_EQ(folder.Folder(), "\\\\server\\share\\dir");
    folder.Choose(0);
    EXPECT_EQ(folder.ChosenPath(), "\\\\server\\share\\dir\\net.dwg");
    EXPECT_EQ(doc.m_strPath, "\\\\server\\share\\dir");
}

TEST_F(DrawingFolderTest, AFolderThatCannotBeReadIsShownEmptyAndTheCurrentDirectoryStays) {
    folder.Show("C:\\dwg");
    reader.problems["C:\\gone"] = "The folder cannot be read";
    EXPECT_FALSE(folder.Show("C:\\gone\\"));
    EXPECT_EQ(folder.Folder(), "C:\\gone");
    EXPECT_EQ(folder.Count(), 0);
    EXPECT_EQ(folder.Problem(), "The folder cannot be read");
    EXPECT_EQ(reader.currentDirectories, std::vector<std::string>{"C:\\dwg"});
    EXPECT_EQ(doc.m_strPath, "C:\\gone"); // title, settings and list name one folder
}

TEST_F(DrawingFolderTest, RefreshReadsTheSameFolderAgainAndKeepsTheChoiceWhileItIsThere) {
    folder.Show("C:\\dwg");
    folder.Choose(1);
    const int chosenBefore = chosen;
    reader.folders["C:\\dwg"].insert(reader.folders["C:\\dwg"].begin(), Drawing("new.dwg"));
    EXPECT_TRUE(folder.Refresh());
    EXPECT_EQ(folder.Count(), 4);
    EXPECT_EQ(reader.reads.size(), 2u);
    // F5 or a file command: the drawing chosen (by a search, a click) is still the one chosen, selected.
    ASSERT_GE(folder.Chosen(), 0);
    EXPECT_EQ(folder.ChosenName(), "a.dwg");
    EXPECT_TRUE(folder.IsSelected(folder.Chosen()));
    EXPECT_EQ(doc.m_strName, "a.dwg");
    EXPECT_EQ(chosen, chosenBefore + 1); // its owner heard it
    // Gone meanwhile: nothing is chosen.
    auto& files = reader.folders["C:\\dwg"];
    files.erase(
        std::remove_if(files.begin(), files.end(), [](const DwgData& d) { return d.m_strName == "a.dwg"; }),
        files.end());
    EXPECT_TRUE(folder.Refresh());
    EXPECT_EQ(folder.Chosen(), -1);
    EXPECT_EQ(doc.m_strName, "");
    // Another folder: the choice does not follow.
    folder.Show("C:\\dwg");
    folder.Choose(0);
    folder.Show("C:\\");
    EXPECT_EQ(folder.Chosen(), -1);
}

TEST_F(DrawingFolderTest, NoFolderEmptiesTheListAndKeepsTheFolderAndTheCurrentDirectory) {
    folder.Show("C:\\dwg");
    folder.ShowNoFolder();
    EXPECT_EQ(folder.Count(), 0);
    EXPECT_EQ(folder.Folder(), "C:\\dwg");
    EXPECT_EQ(doc.m_strPath, "C:\\dwg");
    EXPECT_EQ(reader.currentDirectories.size(), 1u);
    EXPECT_EQ(shown, 2);
}

TEST_F(DrawingFolderTest, ChooseMakesTheDrawingTheOneAcceptReturnsAndTheDocumentsName) {
    folder.Show("C:\\dwg");
    folder.Choose(1);
    EXPECT_EQ(folder.Chosen(), 1);
    EXPECT_EQ(folder.ChosenName(), "a.dwg");
    EXPECT_EQ(folder.ChosenPath(), "C:\\dwg\\a.dwg");
    EXPECT_EQ(doc.m_strName, "a.dwg");
    EXPECT_EQ(chosen, 1);
    folder.ChooseNone();
    EXPECT_EQ(folder.Chosen(), -1);
    EXPECT_EQ(folder.ChosenPath(), "");
    EXPECT_EQ(doc.m_strName, "");
    EXPECT_EQ(chosen, 2);
}

TEST_F(DrawingFolderTest, ChoosingOutsideTheListChoosesNothing) {
    folder.Show("C:\\dwg");
    folder.Choose(1);
    folder.Choose(3);
    EXPECT_EQ(folder.Chosen(), -1);
    EXPECT_EQ(folder.ChosenPath(), "");
}

TEST_F(DrawingFolderTest, ShowingAnotherFolderChoosesNothing) {
    folder.Show("C:\\dwg");
    folder.Choose(0);
    folder.Show("C:\\");
    EXPECT_EQ(folder.Chosen(), -1);
    EXPECT_EQ(doc.m_strName, "");
}

TEST_F(DrawingFolderTest, TheChosenDrawingStaysChosenThroughASort) {
    folder.Show("C:\\dwg");
    folder.Choose(0); // c.dwg
    folder.Sort(DwgSortByName);
    EXPECT_EQ(folder.ChosenName(), "c.dwg");
    EXPECT_EQ(folder.ChosenPath(), "C:\\dwg\\c.dwg");
}

TEST_F(DrawingFolderTest, TheLastDrawingFoundTakesItsPlaceInEveryOrder) {
    // The read finds c, a, b: b, found last, belongs in the middle by name, date and size.
    for (int mode : {DwgSortByName, DwgSortByDate, DwgSortBySize}) {
        SCOPED_TRACE(mode);
        folder.Show("C:\\dwg");
        folder.Choose(2); // b.dwg
        folder.Sort(mode);
        ASSERT_EQ(folder.Count(), 3);
        EXPECT_EQ(folder.Drawing(0).m_strName, "a.dwg");
        EXPECT_EQ(folder.Drawing(1).m_strName, "b.dwg");
        EXPECT_EQ(folder.Drawing(2).m_strName, "c.dwg");
        EXPECT_EQ(folder.Chosen(), 1);
        EXPECT_EQ(folder.ChosenPath(), "C:\\dwg\\b.dwg");
    }
}

TEST_F(DrawingFolderTest, SelectedPathsAreTheSelectedDrawingsInTheFolder) {
    folder.Show("C:\\dwg");
    folder.Select(0);
    folder.Select(2);
    EXPECT_EQ(folder.SelectedPaths(), (std::vector<std::string>{"C:\\dwg\\c.dwg", "C:\\dwg\\b.dwg"}));
    EXPECT_TRUE(folder.AnySelected());
    folder.DeselectAll();
    EXPECT_FALSE(folder.AnySelected());
    folder.SelectAll();
    EXPECT_EQ(folder.SelectedPaths().size(), 3u);
    folder.Deselect(1);
    EXPECT_FALSE(folder.IsSelected(1));
    EXPECT_FALSE(folder.IsSelected(7));
}

TEST_F(DrawingFolderTest, FindIgnoresCase) {
    folder.Show("C:\\dwg");
    EXPECT_EQ(folder.Find("A.DWG"), 1);
    EXPECT_EQ(folder.Find("x.dwg"), -1);
    EXPECT_EQ(folder.CountNamed("a.dwg"), 1);
}

TEST_F(DrawingFolderTest, TheSearchSelectsTheFirstMatchOnly) {
    folder.Show("C:\\dwg");
    folder.Select(0);
    const DwgPrefixSearch found = folder.SelectFirstStartingWith("B");
    EXPECT_TRUE(found.ran);
    EXPECT_EQ(found.match, 2);
    EXPECT_FALSE(folder.IsSelected(0));
    EXPECT_TRUE(folder.IsSelected(2));
}

TEST_F(DrawingFolderTest, WithoutADocumentNothingIsKeptButTheFolderWorks) {
    DrawingFolder alone(reader, nullptr);
    EXPECT_TRUE(alone.Show("C:\\dwg\\"));
    alone.Choose(2);
    EXPECT_EQ(alone.ChosenPath(), "C:\\dwg\\b.dwg");
}

TEST(DrawingFolderSameFolder, CaseAndASeparatorAtTheEndAside) {
    EXPECT_TRUE(DrawingFolder::SameFolder("C:\\Dwg\\", "c:\\dwg"));
    EXPECT_TRUE(DrawingFolder::SameFolder("C:\\", "c:"));
    EXPECT_FALSE(DrawingFolder::SameFolder("C:\\dwg", "C:\\dwg2"));
    EXPECT_FALSE(DrawingFolder::SameFolder("", ""));
}

// ---- a scan that takes long --------------------------------------------------------------------------

namespace {

// A reader whose scans go on until the test ends them, as a thread of its own would.
struct SlowReader : MemoryReader {
    std::vector<std::shared_ptr<FolderScan>> started;
    std::vector<unsigned> waits;

    void Start(const std::shared_ptr<FolderScan>& scan, unsigned waitMs) override {
        started.push_back(scan);
        waits.push_back(waitMs);
    }
    // The scan's thread reaches its end: the folder's drawings as Read gives them.
    void End(std::size_t index) { RunFolderScan(*this, *started.at(index)); }
};

class SlowScanTest : public ::testing::Test {
protected:
    void SetUp() override {
        reader.folders["C:\\big"] = {Drawing("x.dwg"), Drawing("y.dwg")};
        reader.folders["C:\\small"] = {Drawing("s.dwg")};
        folder.onShown = [this] { ++shown; };
    }
    void TearDown() override { BeginScan(); }

    SlowReader reader;
    CTessel3Doc doc{std::string()};
    DrawingFolder folder{reader, &doc};
    int shown = 0;
};

} // namespace

TEST_F(SlowScanTest, AScanNotEndedWithinTheWaitShowsTheFolderEmptyWhileItIsRead) {
    EXPECT_FALSE(folder.Show("C:\\big\\"));
    ASSERT_EQ(reader.started.size(), 1u);
    EXPECT_EQ(reader.waits[0], DrawingFolder::kQuickScanMs);
    EXPECT_EQ(reader.started[0]->folder, "C:\\big");
    EXPECT_TRUE(folder.IsScanning());
    EXPECT_FALSE(folder.IsRead());
    EXPECT_EQ(folder.Folder(), "C:\\big");
    EXPECT_EQ(doc.m_strPath, "C:\\big");
    EXPECT_EQ(folder.Count(), 0);
    EXPECT_EQ(shown, 1); // the frame shows it being read
    EXPECT_TRUE(reader.currentDirectories.empty());
    EXPECT_FALSE(folder.TakeEndedScan());
}

TEST_F(SlowScanTest, TheCountFollowsTheReaderAndTheEndFillsTheListOnTheShowingThread) {
    folder.Show("C:\\big");
    reader.started[0]->progress.found = 1;
    EXPECT_EQ(folder.ScanCount(), 1);
    reader.End(0);
    EXPECT_EQ(shown, 1); // nothing happens on the reading thread
    EXPECT_TRUE(folder.TakeEndedScan());
    EXPECT_FALSE(folder.IsScanning());
    EXPECT_TRUE(folder.IsRead());
    EXPECT_EQ(folder.ScanCount(), 0);
    ASSERT_EQ(folder.Count(), 2);
    EXPECT_EQ(folder.Drawing(1).m_strName, "y.dwg");
    EXPECT_EQ(reader.currentDirectories, std::vector<std::string>{"C:\\big"});
    EXPECT_EQ(shown, 2);
    EXPECT_FALSE(folder.TakeEndedScan()); // taken once
}

TEST_F(SlowScanTest, AFolderThatCannotBeReadSaysSoWhenItsScanEnds) {
    reader.problems["C:\\gone"] = "The folder cannot be read: C:\\gone does not exist";
    folder.Show("C:\\gone");
    reader.End(0);
    EXPECT_TRUE(folder.TakeEndedScan());
    EXPECT_FALSE(folder.IsRead());
    EXPECT_EQ(folder.Problem(), "The folder cannot be read: C:\\gone does not exist");
    EXPECT_TRUE(reader.currentDirectories.empty());
}

TEST_F(SlowScanTest, AnotherFolderShownDuringAScanAbandonsItAndItsResultIsNeverShown) {
    folder.Show("C:\\big");
    folder.Show("C:\\small");
    ASSERT_EQ(reader.started.size(), 2u);
    EXPECT_TRUE(reader.started[0]->progress.abandoned);
    EXPECT_FALSE(reader.started[1]->progress.abandoned);
    reader.End(0); // the first one's thread reaches its end all the same
    EXPECT_FALSE(folder.TakeEndedScan());
    EXPECT_EQ(folder.Count(), 0);
    reader.End(1);
    EXPECT_TRUE(folder.TakeEndedScan());
    ASSERT_EQ(folder.Count(), 1);
    EXPECT_EQ(folder.Drawing(0).m_strName, "s.dwg");
    EXPECT_EQ(folder.Folder(), "C:\\small");
    EXPECT_EQ(reader.currentDirectories, std::vector<std::string>{"C:\\small"});
}

TEST_F(SlowScanTest, NoFolderShownAndTheModelsEndAbandonTheScan) {
    folder.Show("C:\\big");
    folder.ShowNoFolder();
    EXPECT_TRUE(reader.started[0]->progress.abandoned);
    EXPECT_FALSE(folder.IsScanning());
    std::shared_ptr<FolderScan> left;
    {
        DrawingFolder other(reader, nullptr);
        other.Show("C:\\small");
        left = reader.started.back();
        EXPECT_FALSE(left->progress.abandoned);
    }
    EXPECT_TRUE(left->progress.abandoned);
}

TEST_F(SlowScanTest, RefreshDuringAScanReadsTheFolderAgain) {
    folder.Show("C:\\big");
    folder.Refresh();
    ASSERT_EQ(reader.started.size(), 2u);
    EXPECT_TRUE(reader.started[0]->progress.abandoned);
    EXPECT_EQ(reader.started[1]->folder, "C:\\big");
}

TEST(FolderScanRun, AReaderThatThrowsEndsTheScanUnread) {
    struct Throwing : FolderReader {
        bool Read(const std::string&, std::vector<DwgData>& drawings, std::string& problem,
                  ScanProgress&) override {
            drawings.push_back(DwgData());
            problem = "half";
            throw std::bad_alloc();
        }
        void MakeCurrentDirectory(const std::string&) override {}
    } reader;
    FolderScan scan("C:\\x");
    RunFolderScan(reader, scan);
    EXPECT_TRUE(scan.ended);
    EXPECT_FALSE(scan.read);
    EXPECT_TRUE(scan.drawings.empty());
    EXPECT_TRUE(scan.problem.empty());
}
