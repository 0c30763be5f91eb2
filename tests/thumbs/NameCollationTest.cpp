#include "thumbs/NameCollation.h"

#include "thumbs/DwgList.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

namespace {

std::unique_ptr<NameCollation> Western() {
    return FoldedNameCollation(Windows1252NameFold(), LeadBytesOfCodePage(1252));
}

// The names in the order their keys give, as the list's sort puts them.
std::vector<std::string> SortedByKey(NameCollation& collation, std::vector<std::string> names) {
    std::stable_sort(names.begin(), names.end(), [&collation](const std::string& a, const std::string& b) {
        return collation.SortKey(a) < collation.SortKey(b);
    });
    return names;
}

std::vector<std::string> ListSorted(NameCollation& collation, const std::vector<std::string>& names) {
    BeginScan();
    for (const std::string& n : names) {
        DwgFindEntry e;
        e.name = n;
        AppendScanEntry(e);
    }
    SortByName(collation);
    std::vector<std::string> sorted;
    for (int i = 0; i < DwgList.GetSize(); ++i)
        sorted.push_back(DwgList[i].m_strName);
    BeginScan();
    return sorted;
}

TEST(NameCollation, RunsOfDigitsSortByValue) {
    auto c = Western();
    EXPECT_LT(c->SortKey("door-900.dwg"), c->SortKey("door-1000.dwg"));
    EXPECT_LT(c->SortKey("a2"), c->SortKey("a10"));
    EXPECT_LT(c->SortKey("a9b"), c->SortKey("a10a"));
    EXPECT_LT(c->SortKey("2"), c->SortKey("10"));
    EXPECT_LT(c->SortKey("a1b2"), c->SortKey("a1b10"));
    EXPECT_EQ(SortedByKey(*c, {"plan10.dwg", "plan9.dwg", "plan100.dwg", "plan1.dwg"}),
              (std::vector<std::string>{"plan1.dwg", "plan9.dwg", "plan10.dwg", "plan100.dwg"}));
}

TEST(NameCollation, LeadingZerosDoNotCount) {
    auto c = Western();
    EXPECT_EQ(c->SortKey("file01"), c->SortKey("file1"));
    EXPECT_EQ(c->SortKey("file000"), c->SortKey("file0"));
    EXPECT_LT(c->SortKey("file007"), c->SortKey("file10"));
}

TEST(NameCollation, CaseIsIgnored) {
    auto c = Western();
    EXPECT_EQ(c->SortKey("Plan.DWG"), c->SortKey("plan.dwg"));
    EXPECT_EQ(c->SortKey("\xC9TAGE"), c->SortKey("\xE9tage")); // E acute, both cases
    EXPECT_LT(c->SortKey("alpha"), c->SortKey("Beta"));
    EXPECT_LT(c->SortKey("Beta"), c->SortKey("charlie"));
}

TEST(NameCollation, DigitsSortAmongTheOtherCharactersWhereZeroDoes) {
    auto c = Western();
    EXPECT_LT(c->SortKey("a-"), c->SortKey("a1")); // '-' is below '0'
    EXPECT_LT(c->SortKey("a1"), c->SortKey("aa")); // letters are above digits
    EXPECT_LT(c->SortKey("a9"), c->SortKey("a_")); // and so is '_'
    EXPECT_LT(c->SortKey("a"), c->SortKey("a0"));  // a name before its longer forms
}

TEST(NameCollation, EmptyNamesAndNamesOfOnlyDigits) {
    auto c = Western();
    EXPECT_EQ(c->SortKey(""), "");
    EXPECT_LT(c->SortKey(""), c->SortKey("0"));
    EXPECT_LT(c->SortKey(""), c->SortKey("a"));
    EXPECT_LT(c->SortKey("0"), c->SortKey("1"));
    EXPECT_LT(c->SortKey("99"), c->SortKey("100"));
    EXPECT_LT(c->SortKey("123456"), c->SortKey("123457"));
    EXPECT_EQ(SortedByKey(*c, {"100", "", "9", "0010", "0"}),
              (std::vector<std::string>{"", "0", "9", "0010", "100"}));
}

TEST(NameCollation, VeryLongRunsOfDigitsKeepTheirOrder) {
    auto c = Western();
    // Past 20 digits a run does not fit a 64-bit integer; the order holds all the same.
    const std::string twentyNines(20, '9');                           // 99999999999999999999 (> 2^64)
    const std::string oneAndTwentyZeros = "1" + std::string(20, '0'); // 10^20
    EXPECT_LT(c->SortKey("d" + twentyNines), c->SortKey("d" + oneAndTwentyZeros));
    const std::string forty(40, '7');
    std::string fortyNext = forty;
    fortyNext.back() = '8';
    EXPECT_LT(c->SortKey("d" + forty), c->SortKey("d" + fortyNext));
    EXPECT_LT(c->SortKey("d" + forty + ".dwg"), c->SortKey("d1" + forty + ".dwg"));
    const std::string longest(300, '5');
    EXPECT_LT(c->SortKey(std::string(299, '9')), c->SortKey(longest));
    EXPECT_EQ(c->SortKey(std::string(30, '0') + "42"), c->SortKey("42"));
}

TEST(NameCollation, TiesAreBrokenByTheBytesThenTheOrderFound) {
    auto c = Western();
    // Equal keys: file01 and file1 by their bytes, whichever came first.
    EXPECT_EQ(ListSorted(*c, {"file1.dwg", "file01.dwg", "file001.dwg"}),
              (std::vector<std::string>{"file001.dwg", "file01.dwg", "file1.dwg"}));
    EXPECT_EQ(ListSorted(*c, {"file01.dwg", "file001.dwg", "file1.dwg"}),
              (std::vector<std::string>{"file001.dwg", "file01.dwg", "file1.dwg"}));
    // The same name twice (names the code page turned into the same one) keeps its records' order.
    BeginScan();
    for (std::int64_t t : {3, 1, 2}) {
        DwgFindEntry e;
        e.name = "same.dwg";
        e.timeWrite = t;
        AppendScanEntry(e);
    }
    SortByName(*c);
    ASSERT_EQ(DwgList.GetSize(), 3);
    EXPECT_EQ(DwgList[0].m_timeWrite, 3);
    EXPECT_EQ(DwgList[1].m_timeWrite, 1);
    EXPECT_EQ(DwgList[2].m_timeWrite, 2);
    BeginScan();
}

TEST(NameCollation, TheListSortsByValueWithCaseIgnored) {
    auto c = Western();
    EXPECT_EQ(ListSorted(*c, {"door-1000.dwg", "Door-900.dwg", "door-90.dwg", "DOOR-9.dwg", "a.dwg", ""}),
              (std::vector<std::string>{"", "a.dwg", "DOOR-9.dwg", "door-90.dwg", "Door-900.dwg",
                                        "door-1000.dwg"}));
}

TEST(NameCollation, DoubleByteCharactersKeepBothBytesAndDigitsAfterThem) {
    auto c = FoldedNameCollation(Windows1252NameFold(), LeadBytesOfCodePage(932));
    // 0x83 0x5C is one character (katakana so); "2" after it is a run of digits of its own.
    const std::string so = "\x83\x5C";
    EXPECT_LT(c->SortKey(so + "2"), c->SortKey(so + "10"));
    EXPECT_NE(c->SortKey("\x83\x41"), c->SortKey("\x83\x61")); // a trail byte is no letter to fold
    EXPECT_TRUE(c->StartsWith(so + "abc", so + "AB"));
    EXPECT_FALSE(c->StartsWith("\x83\x41", "\x83\x61"));
    // A lead byte alone at the end is a character of one byte.
    EXPECT_EQ(c->SortKey("a\x83").size(), 2u);
}

TEST(NameCollation, StartsWithIgnoresCaseCharacterByCharacter) {
    auto c = Western();
    EXPECT_TRUE(c->StartsWith("plan.dwg", "PL"));
    EXPECT_TRUE(c->StartsWith("plan.dwg", "plan.dwg"));
    EXPECT_TRUE(c->StartsWith("plan.dwg", ""));
    EXPECT_TRUE(c->StartsWith("\xE9tage.dwg", "\xC9T"));
    EXPECT_TRUE(c->StartsWith("door-900.dwg", "door-9")); // digits one by one, not by value
    EXPECT_FALSE(c->StartsWith("door-900.dwg", "door-90."));
    EXPECT_FALSE(c->StartsWith("plan", "plan.dwg"));
    EXPECT_FALSE(c->StartsWith("plan.dwg", "plb"));
    EXPECT_FALSE(c->StartsWith("", "a"));
    EXPECT_FALSE(c->StartsWith("etage", "\xE9")); // an accent counts in the search
}

TEST(NameCollation, WeightsAreAskedOnceACharacter) {
    int asked = 0;
    NameCollation c(
        LeadBytesOfCodePage(932),
        [&asked](unsigned code) {
            ++asked;
            CharacterWeights w;
            w.key[0] = static_cast<std::uint8_t>(code);
            w.keyLength = w.primaryLength = 1;
            return w;
        },
        0x10);
    c.SortKey("abcabc");
    c.SortKey("cab");
    EXPECT_EQ(asked, 3);
    c.SortKey("\x83\x5C\x83\x5C");
    EXPECT_EQ(asked, 4);
}

TEST(NameCollation, ACharacterTheSortPassesOverStillCountsInTheSearch) {
    // As a locale does with a hyphen: no weight in the order, a weight of its own for the search.
    NameCollation c(
        LeadBytesOfCodePage(1252),
        [](unsigned code) {
            CharacterWeights w;
            if (code >= '0' && code <= '9')
                w.digit = static_cast<std::uint8_t>(code - '0');
            w.key[0] = static_cast<std::uint8_t>(code);
            w.keyLength = 1;
            w.primaryLength = code == '-' ? 0 : 1;
            return w;
        },
        '0');
    EXPECT_EQ(c.SortKey("co-op"), c.SortKey("coop"));
    EXPECT_FALSE(c.StartsWith("coop", "co-"));
    EXPECT_TRUE(c.StartsWith("co-op", "co-"));
}

TEST(NameCollation, TheActiveOneIsBuiltOnce) {
    EXPECT_EQ(&ActiveNameCollation(), &ActiveNameCollation());
    EXPECT_LT(ActiveNameCollation().SortKey("door-900.dwg"), ActiveNameCollation().SortKey("door-1000.dwg"));
}

} // namespace
