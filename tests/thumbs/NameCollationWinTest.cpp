// The drawing list sorted and searched with the system's collation, in the Western code page and, run
// again with Wine in the Japanese, Chinese and Korean locales, in theirs. Names are narrow, as the scan
// lists them: each test writes its names as wide text and converts them to the system's code page.
#include "thumbs/DwgList.h"
#include "thumbs/NameCollation.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include <windows.h>

namespace {

std::string Narrow(const std::wstring& wide) {
    const int n = ::WideCharToMultiByte(CP_ACP, 0, wide.c_str(), -1, nullptr, 0, nullptr, nullptr);
    std::string text(n > 0 ? n - 1 : 0, '\0');
    if (n > 1)
        ::WideCharToMultiByte(CP_ACP, 0, wide.c_str(), -1, text.data(), n, nullptr, nullptr);
    return text;
}

// Lists the names as the scan does (lowered through the fold table) and sorts them by name.
std::vector<std::string> SortedByName(const std::vector<std::wstring>& names) {
    BeginScan();
    for (const std::wstring& wide : names) {
        DwgFindEntry e;
        e.name = Narrow(wide);
        EXPECT_TRUE(AcceptScanEntry(e, ".dwg"));
        AppendScanEntry(e);
    }
    SortDwgList(DwgSortByName);
    std::vector<std::string> sorted;
    for (int i = 0; i < DwgList.GetSize(); ++i)
        sorted.push_back(DwgList[i].m_strName);
    return sorted;
}

std::vector<std::string> Listed(const std::vector<std::wstring>& names) {
    std::vector<std::string> narrow;
    for (const std::wstring& wide : names) {
        DwgFindEntry e;
        e.name = Narrow(wide);
        AcceptScanEntry(e, ".dwg");
        narrow.push_back(e.name);
    }
    return narrow;
}

class NameCollationWin : public ::testing::Test {
protected:
    void TearDown() override { BeginScan(); }
};

// Each test holds names of one code page and runs in the locale that has it.
#define ONLY_IN_CODE_PAGE(cp)                                                                                \
    if (::GetACP() != (cp))                                                                                  \
    GTEST_SKIP() << "runs in code page " << (cp) << ", this is " << ::GetACP()

TEST_F(NameCollationWin, WesternAccentsSortWithTheirLettersAndNumbersByValue) {
    ONLY_IN_CODE_PAGE(1252);
    EXPECT_EQ(
        SortedByName({L"f.dwg", L"\x00C9tage.dwg", L"e.dwg", L"Z.dwg", L"door-1000.dwg", L"door-900.dwg"}),
        Listed({L"door-900.dwg", L"door-1000.dwg", L"e.dwg", L"\x00E9tage.dwg", L"f.dwg", L"z.dwg"}));
    // E acute between e and f, not after z as its byte (0xE9) would put it.
    EXPECT_EQ(SortedByName({L"f1.dwg",
                            L"\x00E9"
                            L"1.dwg",
                            L"e1.dwg", L"z1.dwg"}),
              Listed({L"e1.dwg",
                      L"\x00E9"
                      L"1.dwg",
                      L"f1.dwg", L"z1.dwg"}));
}

TEST_F(NameCollationWin, WesternSearchIgnoresCaseButNotAccents) {
    ONLY_IN_CODE_PAGE(1252);
    SortedByName({L"etage.dwg", L"\x00E9tage.dwg", L"plan.dwg"});
    EXPECT_EQ(FindByPrefixIndex(Narrow(L"\x00C9T")), 1);
    EXPECT_EQ(FindByPrefixIndex("ET"), 0);
    EXPECT_EQ(FindByPrefixIndex("PLAN.DWG"), 2);
    EXPECT_EQ(FindByPrefixIndex("plan.dwgx"), -1);
}

TEST_F(NameCollationWin, FullWidthLettersAndDigitsSortWithTheirHalfWidthForms) {
    ONLY_IN_CODE_PAGE(932);
    // Full-width B (0x82 0x61) with b, full-width 2 by its value; kana by syllable whatever its kind.
    EXPECT_EQ(SortedByName({L"c.dwg", L"\xFF22.dwg", L"a.dwg"}), Listed({L"a.dwg", L"\xFF22.dwg", L"c.dwg"}));
    EXPECT_EQ(SortedByName({L"\x56F3\x9762\xFF11\xFF10.dwg", L"\x56F3\x9762\xFF12.dwg",
                            L"\x56F3\x9762"
                            L"3.dwg"}),
              Listed({L"\x56F3\x9762\xFF12.dwg",
                      L"\x56F3\x9762"
                      L"3.dwg",
                      L"\x56F3\x9762\xFF11\xFF10.dwg"}));
    // Katakana a (0x83 0x41) before hiragana i and u (0x82 0xA2, 0x82 0xA4), as the syllables go.
    EXPECT_EQ(SortedByName({L"\x3044.dwg", L"\x30A2.dwg", L"\x3046.dwg"}),
              Listed({L"\x30A2.dwg", L"\x3044.dwg", L"\x3046.dwg"}));
}

TEST_F(NameCollationWin, TypedHalfWidthTextFindsAFullWidthName) {
    ONLY_IN_CODE_PAGE(932);
    SortedByName({L"a.dwg", L"\xFF22\xFF4F\xFF58.dwg", L"c.dwg"}); // full-width "Box"
    EXPECT_EQ(FindByPrefixIndex("B"), 1);
    EXPECT_EQ(FindByPrefixIndex("box"), 1);
    EXPECT_EQ(FindByPrefixIndex(Narrow(L"\xFF42")), 1); // full-width b typed finds it too
    EXPECT_EQ(FindByPrefixIndex("bx"), -1);
    SortedByName({L"\x30BD\x30D5\x30C8.dwg", L"b.dwg"}); // katakana "so-fu-to"
    EXPECT_EQ(FindByPrefixIndex(Narrow(L"\x305D")), 1);  // hiragana "so" finds it: kana type ignored
    EXPECT_EQ(FindByPrefixIndex(Narrow(L"\x30BD\x30D5\x30C8.DWG")), 1);
}

TEST_F(NameCollationWin, KoreanExtensionSyllablesSortAmongTheCommonOnes) {
    ONLY_IN_CODE_PAGE(949);
    // gakk (U+AC02) and ttom (U+B620) are in the code page's extension range (lead bytes 0x81-0xA0): by
    // bytes they came before every common syllable.
    const std::wstring domyeon = L"\xB3C4\xBA74"; // "drawing"
    const std::wstring hanguk = L"\xD55C\xAD6D";  // "Korea"
    EXPECT_EQ(
        SortedByName({hanguk + L".dwg", L"\xB620.dwg", domyeon + L".dwg", L"\xAC02.dwg", L"\xAC00.dwg"}),
        Listed({L"\xAC00.dwg", L"\xAC02.dwg", domyeon + L".dwg", L"\xB620.dwg", hanguk + L".dwg"}));
}

TEST_F(NameCollationWin, GbkExtensionCharactersSortAmongTheCommonOnes) {
    ONLY_IN_CODE_PAGE(936);
    // kao (U+4E02, 0x81 0x40) is a GBK extension character: by bytes it came before an (U+5B89, 0xB0 0xB2)
    // and every other common character; by the locale's order it follows it.
    EXPECT_EQ(SortedByName({L"\x4E02.dwg", L"\x5B89.dwg", L"\x4E00.dwg"}),
              Listed({L"\x5B89.dwg", L"\x4E02.dwg", L"\x4E00.dwg"}));
}

TEST_F(NameCollationWin, WeightsComeFromTheSystemOncePerCharacter) {
    NameCollation& c = ActiveNameCollation();
    EXPECT_EQ(&c.Weights('a'), &c.Weights('a'));
    EXPECT_EQ(c.Weights('7').digit, 7);
    EXPECT_GT(c.Weights('a').primaryLength, 0);
    EXPECT_LT(c.SortKey("door-900.dwg"), c.SortKey("door-1000.dwg"));
    EXPECT_EQ(c.SortKey("DOOR"), c.SortKey("door"));
    EXPECT_LT(c.SortKey("a9"), c.SortKey("aa")); // digits before letters, as the system has them
}

} // namespace
