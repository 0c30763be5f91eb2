#include "thumbs/DwgList.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

DwgFindEntry File(const std::string& name, std::int64_t time = 0, std::uint64_t size = 0) {
    DwgFindEntry e;
    e.name = name;
    e.timeWrite = time;
    e.size = size;
    return e;
}

DwgFindEntry Folder(const std::string& name) {
    DwgFindEntry e = File(name);
    e.isDirectory = true;
    return e;
}

std::vector<std::string> Names() {
    std::vector<std::string> names;
    for (int i = 0; i < DwgList.GetSize(); ++i)
        names.push_back(DwgList[i].m_strName);
    return names;
}

int Scan(const std::vector<DwgFindEntry>& entries) {
    return ScanEntries(entries.data(), static_cast<int>(entries.size()), ".dwg");
}

class DwgListTest : public ::testing::Test {
protected:
    void SetUp() override { BeginScan(); }
    void TearDown() override { BeginScan(); }
};

TEST(DwgData, EmptyRecordIsNotSelected) {
    DwgData d;
    EXPECT_FALSE(d.IsSelected());
    EXPECT_EQ(d.m_bSelected, 0);
    EXPECT_TRUE(d.m_strName.empty());
}

TEST(DwgData, BuiltFromSearchEntry) {
    DwgData d(File("plan.dwg", 1614953229, 1234));
    EXPECT_EQ(d.m_strName, "plan.dwg");
    EXPECT_EQ(d.m_timeWrite, 1614953229);
    EXPECT_EQ(d.m_nSize, 1234u);
    EXPECT_EQ(d.m_bSelected, 0);
}

TEST(DwgData, KeepsSizesOfFourGibibytesAndMore) {
    EXPECT_EQ(DwgData(File("3g.dwg", 0, 3221225472u)).m_nSize, 3221225472u);
    EXPECT_EQ(DwgData(File("5g.dwg", 0, 5368709120ull)).m_nSize, 5368709120ull);
}

TEST(DwgData, CopyAndAssignmentCopyAllFields) {
    DwgData a(File("a.dwg", -5, 7));
    a.Select();
    DwgData b(a);
    EXPECT_EQ(b.m_bSelected, 1);
    EXPECT_EQ(b.m_strName, "a.dwg");
    EXPECT_EQ(b.m_timeWrite, -5);
    EXPECT_EQ(b.m_nSize, 7u);
    DwgData c;
    c = a;
    EXPECT_TRUE(c.IsSelected());
    EXPECT_EQ(c.m_strName, "a.dwg");
    EXPECT_EQ(c.m_timeWrite, -5);
    EXPECT_EQ(c.m_nSize, 7u);
}

TEST(DwgData, SelectAndDeselect) {
    DwgData d;
    d.Select();
    EXPECT_TRUE(d.IsSelected());
    EXPECT_EQ(d.m_bSelected, 1);
    d.Deselect();
    EXPECT_FALSE(d.IsSelected());
}

TEST(AcceptScanEntry, LowerCasesAndTestsSubstring) {
    DwgFindEntry e = File("A.DWG");
    EXPECT_TRUE(AcceptScanEntry(e, ".dwg"));
    EXPECT_EQ(e.name, "a.dwg");
    DwgFindEntry old = File("c.Dwg.old");
    EXPECT_TRUE(AcceptScanEntry(old, ".dwg"));
    EXPECT_EQ(old.name, "c.dwg.old");
    DwgFindEntry x = File("a.dwgx");
    EXPECT_TRUE(AcceptScanEntry(x, ".dwg"));
    DwgFindEntry txt = File("Readme.TXT");
    EXPECT_FALSE(AcceptScanEntry(txt, ".dwg"));
    EXPECT_EQ(txt.name, "readme.txt");
    DwgFindEntry nodot = File("dwg");
    EXPECT_FALSE(AcceptScanEntry(nodot, ".dwg"));
}

TEST(AcceptScanEntry, DirectoriesOnlyWhenNameBeginsWithDot) {
    DwgFindEntry sub = Folder("x.dwg");
    EXPECT_FALSE(AcceptScanEntry(sub, ".dwg"));
    DwgFindEntry hidden = Folder(".X.dwg");
    EXPECT_TRUE(AcceptScanEntry(hidden, ".dwg"));
    EXPECT_EQ(hidden.name, ".x.dwg");
    DwgFindEntry dot = Folder(".");
    EXPECT_FALSE(AcceptScanEntry(dot, ".dwg"));
    DwgFindEntry dotdot = Folder("..");
    EXPECT_FALSE(AcceptScanEntry(dotdot, ".dwg"));
}

TEST_F(DwgListTest, ScanKeepsMatchingFilesLowerCased) {
    EXPECT_EQ(Scan({Folder("."), Folder(".."), File("A.DWG"), File("b.dwg"), File("notes.txt"),
                    File("c.Dwg.old"), Folder("x.dwg"), Folder(".x.dwg")}),
              1);
    EXPECT_EQ(Names(), (std::vector<std::string>{"a.dwg", "b.dwg", "c.dwg.old", ".x.dwg"}));
}

TEST_F(DwgListTest, ScanStoresTimeAndSize) {
    Scan({File("a.dwg", 100, 2000)});
    ASSERT_EQ(DwgList.GetSize(), 1);
    EXPECT_EQ(DwgList[0].m_timeWrite, 100);
    EXPECT_EQ(DwgList[0].m_nSize, 2000u);
    EXPECT_FALSE(DwgList[0].IsSelected());
}

TEST_F(DwgListTest, ScanOfEmptyFolderGivesZeroAndEmptiesList) {
    Scan({File("a.dwg")});
    EXPECT_EQ(Scan({}), 0);
    EXPECT_EQ(DwgList.GetSize(), 0);
}

TEST_F(DwgListTest, ScanStartsFromEmptyWithGrowStepAndShrinksAtEnd) {
    Scan({File("old1.dwg"), File("old2.dwg")});
    std::vector<DwgFindEntry> many;
    for (int i = 0; i < 150; ++i)
        many.push_back(File("f" + std::to_string(i) + ".dwg"));
    BeginScan();
    EXPECT_EQ(DwgList.GetSize(), 0);
    EXPECT_EQ(DwgList.GetGrowBy(), kDwgListGrowBy);
    EXPECT_EQ(DwgList.GetAllocated(), 0u);
    AppendScanEntry(many[0]);
    EXPECT_EQ(DwgList.GetAllocated(), 100u); // grows by whole steps
    for (int i = 1; i < 150; ++i)
        AppendScanEntry(many[static_cast<std::size_t>(i)]);
    EXPECT_EQ(DwgList.GetAllocated(), 200u);
    EndScan();
    EXPECT_EQ(DwgList.GetAllocated(), 150u);
    EXPECT_EQ(DwgList[0].m_strName, "f0.dwg");
}

TEST_F(DwgListTest, WholeFolderAppendGrowsByStepsAndKeepsTheScanOrder) {
    std::vector<DwgData> records;
    for (int i = 0; i < 250; ++i)
        records.emplace_back(File("r" + std::to_string(i) + ".dwg"));
    BeginScan();
    AppendScanRecords(std::move(records));
    EXPECT_EQ(DwgList.GetSize(), 250);
    EXPECT_EQ(DwgList.GetAllocated(), 300u);
    EndScan();
    EXPECT_EQ(DwgList.GetAllocated(), 250u);
    EXPECT_EQ(DwgList.GetGrowBy(), kDwgListGrowBy);
    EXPECT_EQ(DwgList[0].m_strName, "r0.dwg");
    EXPECT_EQ(DwgList[249].m_strName, "r249.dwg");
}

TEST_F(DwgListTest, IndexOutsideListThrows) {
    Scan({File("a.dwg")});
    EXPECT_THROW(DwgList[1], CInvalidArgException);
    EXPECT_THROW(DwgList[-1], CInvalidArgException);
}

TEST(CompareNamesNoCase, FoldsTheCodePageLetters) {
    EXPECT_EQ(CompareNamesNoCase("Plan.DWG", "plan.dwg"), 0);
    EXPECT_LT(CompareNamesNoCase("a", "B"), 0);
    EXPECT_GT(CompareNamesNoCase("b", "A"), 0);
    EXPECT_LT(CompareNamesNoCase("ab", "abc"), 0);
    EXPECT_GT(CompareNamesNoCase("abc", "AB"), 0);
    EXPECT_LT(CompareNamesNoCase("_", "A"), 0);               // letters compare as lower case
    EXPECT_EQ(CompareNamesNoCase("\xC9tage", "\xE9TAGE"), 0); // E acute, both cases
    EXPECT_LT(CompareNamesNoCase("z", "\xE9"), 0);            // bytes compare unsigned
    EXPECT_NE(CompareNamesNoCase("\xD7", "\xF7"), 0);         // multiplication and division signs
    EXPECT_EQ(CompareNamesNoCase("", ""), 0);
}

TEST(AcceptScanEntry, LowersTheCodePageLettersAsTheSearchFoldsThem) {
    DwgFindEntry e = File("\xC9TAGE-\x8A.DWG");
    EXPECT_TRUE(AcceptScanEntry(e, ".dwg"));
    EXPECT_EQ(e.name, "\xE9tage-\x9A.dwg");
}

TEST_F(DwgListTest, SortByNameMovesTheLastFileFoundToo) {
    Scan({File("c.dwg"), File("a.dwg"), File("b.dwg")});
    SortDwgList(DwgSortByName);
    EXPECT_EQ(Names(), (std::vector<std::string>{"a.dwg", "b.dwg", "c.dwg"}));
}

TEST_F(DwgListTest, TheLastFileFoundTakesItsPlaceInEveryOrder) {
    // Found last, yet first by name, date and size alike.
    Scan({File("m.dwg", 200, 1400000), File("z.dwg", 300, 800000), File("a.dwg", 100, 19000)});
    for (int mode : {DwgSortByName, DwgSortByDate, DwgSortBySize}) {
        SCOPED_TRACE(mode);
        SortDwgList(mode);
        EXPECT_EQ(DwgList[0].m_strName, "a.dwg");
    }
    SortDwgList(DwgSortBySize);
    EXPECT_EQ(Names(), (std::vector<std::string>{"a.dwg", "z.dwg", "m.dwg"}));
}

TEST_F(DwgListTest, SortByNameIgnoresCase) {
    AppendScanEntry(File("Beta.dwg"));
    AppendScanEntry(File("alpha.dwg"));
    AppendScanEntry(File("CHARLIE.dwg"));
    AppendScanEntry(File("Aardvark.dwg"));
    SortDwgList(DwgSortByName);
    EXPECT_EQ(Names(), (std::vector<std::string>{"Aardvark.dwg", "alpha.dwg", "Beta.dwg", "CHARLIE.dwg"}));
}

TEST_F(DwgListTest, SortByNameTakesRunsOfDigitsByValue) {
    Scan({File("door-1000.dwg"), File("door-900.dwg"), File("Door-90.dwg"), File("door-9a.dwg")});
    SortDwgList(DwgSortByName);
    EXPECT_EQ(Names(),
              (std::vector<std::string>{"door-9a.dwg", "door-90.dwg", "door-900.dwg", "door-1000.dwg"}));
}

TEST_F(DwgListTest, SortByDateOldestFirst) {
    Scan({File("n.dwg", 300), File("o.dwg", -10), File("m.dwg", 200), File("z.dwg", 0)});
    SortDwgList(DwgSortByDate);
    EXPECT_EQ(Names(), (std::vector<std::string>{"o.dwg", "z.dwg", "m.dwg", "n.dwg"}));
}

TEST_F(DwgListTest, SortBySizeSmallestFirst) {
    Scan({File("big.dwg", 0, 4000000000u), File("small.dwg", 0, 10), File("mid.dwg", 0, 500),
          File("z.dwg", 0, 1)});
    SortDwgList(DwgSortBySize);
    EXPECT_EQ(Names(), (std::vector<std::string>{"z.dwg", "small.dwg", "mid.dwg", "big.dwg"}));
}

TEST_F(DwgListTest, SortBySizeAroundTwoAndFourGibibytes) {
    // 2^31 and 2^32 are where 32-bit sizes turn negative or wrap to small numbers.
    const std::uint64_t k2G = 1ull << 31;
    const std::uint64_t k4G = 1ull << 32;
    Scan({File("4g.dwg", 0, k4G), File("2g-1.dwg", 0, k2G - 1), File("5g.dwg", 0, 5 * (1ull << 30)),
          File("4g+1.dwg", 0, k4G + 1), File("2g.dwg", 0, k2G), File("4g-1.dwg", 0, k4G - 1),
          File("small.dwg", 0, 19000), File("2g+1.dwg", 0, k2G + 1)});
    SortDwgList(DwgSortBySize);
    EXPECT_EQ(Names(), (std::vector<std::string>{"small.dwg", "2g-1.dwg", "2g.dwg", "2g+1.dwg", "4g-1.dwg",
                                                 "4g.dwg", "4g+1.dwg", "5g.dwg"}));
    EXPECT_EQ(DwgList[7].m_nSize, 5368709120u);
}

TEST_F(DwgListTest, EqualSizesComeOutInEitherOrder) {
    Scan({File("b.dwg", 0, 5), File("a.dwg", 0, 5), File("c.dwg", 0, 1), File("z.dwg", 0, 9)});
    SortDwgList(DwgSortBySize);
    const auto names = Names();
    EXPECT_EQ(names[0], "c.dwg");
    EXPECT_TRUE((names[1] == "a.dwg" && names[2] == "b.dwg") || (names[1] == "b.dwg" && names[2] == "a.dwg"));
    EXPECT_EQ(names[3], "z.dwg");
}

TEST_F(DwgListTest, SortOfOneOrNoRecordChangesNothing) {
    SortDwgList(DwgSortByName);
    EXPECT_EQ(DwgList.GetSize(), 0);
    Scan({File("only.dwg")});
    SortDwgList(DwgSortByName);
    EXPECT_EQ(Names(), (std::vector<std::string>{"only.dwg"}));
}

TEST_F(DwgListTest, UnknownModeLeavesOrder) {
    Scan({File("c.dwg", 3, 3), File("a.dwg", 1, 1), File("b.dwg", 2, 2)});
    SortDwgList(3);
    SortDwgList(-1);
    EXPECT_EQ(Names(), (std::vector<std::string>{"c.dwg", "a.dwg", "b.dwg"}));
}

TEST_F(DwgListTest, LargeSortOrdersEveryRecord) {
    std::vector<DwgFindEntry> entries;
    for (int i = 0; i < 1000; ++i)
        entries.push_back(
            File("f" + std::to_string((i * 7919) % 1000) + ".dwg", (i * 31) % 997, (i * 13) % 1009));
    Scan(entries);
    for (int mode = 0; mode < 3; ++mode) {
        SortDwgList(mode);
        ASSERT_EQ(DwgList.GetSize(), 1000);
        if (mode == 0) {
            // The numbers in the names by value: f0, f1, f2, ... f999.
            for (int i = 0; i < 1000; ++i)
                ASSERT_EQ(DwgList[i].m_strName, "f" + std::to_string(i) + ".dwg");
            continue;
        }
        for (int i = 1; i < 1000; ++i) {
            const DwgData& a = DwgList[i - 1];
            const DwgData& b = DwgList[i];
            if (mode == 1)
                ASSERT_LE(a.m_timeWrite, b.m_timeWrite);
            else
                ASSERT_LE(a.m_nSize, b.m_nSize);
        }
    }
}

TEST_F(DwgListTest, SelectionFlags) {
    EXPECT_FALSE(AnySelected());
    Scan({File("a.dwg"), File("b.dwg"), File("c.dwg")});
    EXPECT_FALSE(AnySelected());
    DwgList[1].Select();
    DwgList[2].Select();
    EXPECT_TRUE(AnySelected());
    DeselectAllFlags();
    EXPECT_FALSE(AnySelected());
    EXPECT_FALSE(DwgList[1].IsSelected());
}

// Names that differ only in case are listed under one name: a pick must see that it names two files.
TEST_F(DwgListTest, CountListedSeesNamesThatDifferOnlyInCase) {
    EXPECT_EQ(CountListed("plan.dwg"), 0);
    Scan({File("Plan.dwg"), File("plan.DWG"), File("door.dwg")});
    EXPECT_EQ(CountListed("plan.dwg"), 2);
    EXPECT_EQ(CountListed("door.dwg"), 1);
    EXPECT_EQ(CountListed("Plan.dwg"), 0);
    EXPECT_EQ(CountListed("do"), 0);
}

void Append(const std::vector<std::string>& names) {
    for (const std::string& n : names)
        AppendScanEntry(File(n));
}

TEST_F(DwgListTest, FindByPrefixFindsLongerNameIgnoringCase) {
    Append({"a.dwg", "plan1.dwg", "plan2.dwg"});
    EXPECT_EQ(FindByPrefixIndex("plan"), 1);
    EXPECT_EQ(FindByPrefixIndex("PLAN"), 1);
    EXPECT_EQ(FindByPrefixIndex("Plan2"), 2);
}

TEST_F(DwgListTest, FindByPrefixMatchesAWholeName) {
    Append({"plan", "other.dwg", "other.dwg.bak"});
    EXPECT_EQ(FindByPrefixIndex("plan"), 0);
    EXPECT_EQ(FindByPrefixIndex("other.dwg"), 1);
    EXPECT_EQ(FindByPrefixIndex("OTHER.DWG"), 1);
    EXPECT_EQ(FindByPrefixIndex("other.dwg."), 2);
    EXPECT_EQ(FindByPrefixIndex("other.dwg.bak2"), -1); // longer than every name
}

TEST_F(DwgListTest, FindByPrefixFoldsTheCodePageLetters) {
    Scan({File("a.dwg"), File("\xC9tage.dwg"), File("z.dwg")});
    EXPECT_EQ(DwgList[1].m_strName, "\xE9tage.dwg"); // the scan lowered it
    EXPECT_EQ(FindByPrefixIndex("\xC9T"), 1);
    EXPECT_EQ(FindByPrefixIndex("\xE9t"), 1);
}

TEST_F(DwgListTest, FindByPrefixClearsFlagsAndMarksMatch) {
    Scan({File("a.dwg"), File("b.dwg"), File("plan1.dwg"), File("c.dwg")});
    for (int i = 0; i < 4; ++i)
        DwgList[i].Select();
    const DwgPrefixSearch found = FindByPrefix("pl");
    EXPECT_TRUE(found.ran);
    EXPECT_EQ(found.match, 2);
    EXPECT_FALSE(DwgList[0].IsSelected());
    EXPECT_FALSE(DwgList[1].IsSelected());
    EXPECT_TRUE(DwgList[2].IsSelected());
    EXPECT_FALSE(DwgList[3].IsSelected());
}

TEST_F(DwgListTest, FindByPrefixWithoutMatchSelectsNothing) {
    Scan({File("a.dwg"), File("b.dwg")});
    DwgList[0].Select();
    DwgList[1].Select();
    const DwgPrefixSearch found = FindByPrefix("zz");
    EXPECT_TRUE(found.ran);
    EXPECT_EQ(found.match, -1);
    EXPECT_FALSE(AnySelected());
}

TEST_F(DwgListTest, FindByPrefixMatchOnFirstRecordKeepsItSelected) {
    Scan({File("plan1.dwg"), File("b.dwg")});
    EXPECT_EQ(FindByPrefixIndex("plan"), 0);
    EXPECT_TRUE(DwgList[0].IsSelected());
}

TEST_F(DwgListTest, EmptyTextOrEmptyListTouchesNothing) {
    const DwgPrefixSearch none = FindByPrefix("plan");
    EXPECT_FALSE(none.ran);
    EXPECT_EQ(none.match, -1);
    Scan({File("plan1.dwg"), File("b.dwg")});
    DwgList[1].Select();
    const DwgPrefixSearch empty = FindByPrefix("");
    EXPECT_FALSE(empty.ran);
    EXPECT_TRUE(DwgList[1].IsSelected());
}

TEST(ScanPaths, FolderPathsTooLongForThePathBuffersAreRefused) {
    EXPECT_EQ(FolderPathProblem("C:\\Drawings"), "");
    EXPECT_EQ(FolderPathProblem("C:\\"), "");
    EXPECT_NE(FolderPathProblem(""), "");
    // The pattern adds "\*": 257 characters are the most a folder may have.
    const std::string longest = "C:\\" + std::string(254, 'd');
    ASSERT_EQ(longest.size(), 257u);
    EXPECT_EQ(FolderPathProblem(longest), "");
    EXPECT_EQ(FolderPathProblem(longest + "\\"), ""); // a separator of its own takes the place of one
    for (std::size_t length : {258u, 259u, 260u, 1000u}) {
        const std::string folder = "C:\\" + std::string(length - 3, 'd');
        ASSERT_EQ(folder.size(), length);
        EXPECT_EQ(FolderPathProblem(folder), "The folder cannot be read: its path is " +
                                                 std::to_string(length) +
                                                 " characters long, at most 257 are possible")
            << length;
    }
}

TEST(ScanPaths, FullPathOfAFileMustFit) {
    const std::string folder = "C:\\" + std::string(200, 'd');
    EXPECT_TRUE(FullPathFits(folder, std::string(55, 'n')));  // 203 + 1 + 55 = 259
    EXPECT_FALSE(FullPathFits(folder, std::string(56, 'n'))); // 260
    EXPECT_TRUE(FullPathFits(folder + "\\", std::string(55, 'n')));
    EXPECT_TRUE(FullPathFits("C:\\", std::string(256, 'n')));
    EXPECT_FALSE(FullPathFits("C:\\", std::string(257, 'n')));
    EXPECT_EQ(SkippedFilesMessage(0), "");
    EXPECT_EQ(SkippedFilesMessage(1), "1 drawing is not shown: the full path is longer than 259 characters");
    EXPECT_EQ(SkippedFilesMessage(3),
              "3 drawings are not shown: the full path is longer than 259 characters");
}

} // namespace
