// The helpers on the characters whose second byte is "\" (0x5C) or "|" (0x7C) in their code page, written
// as their bytes so the test reads the same in any editor.
#include "hostapi/NarrowText.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

// Japanese (932)
const std::string kHyo932 = "\x95\x5C";                    // 表
const std::string kSo932 = "\x83\x5C";                     // ソ
const std::string kNo932 = "\x94\x5C";                     // 能
const std::string kPo932 = "\x83\x7C";                     // ポ
const std::string kZuhyo932 = "\x90\x7D\x95\x5C";          // 図表
const std::string kSofuto932 = "\x83\x5C\x83\x74\x83\x67"; // ソフト
const std::string kHalfKa932 = "\xB6";                     // half-width katakana: one byte
// Simplified Chinese (936)
const std::string kUn936 = "\xDF\x5C";           // 運
const std::string kTo936 = "\x96\x7C";           // 東
const std::string kUnyu936 = "\xDF\x5C\xDD\x94"; // 運輸
// Traditional Chinese (950)
const std::string kKo950 = "\xA5\x5C";                       // 功
const std::string kKyoKoGai950 = "\xB3\x5C\xA5\x5C\xBB\x5C"; // 許功蓋
// Korean (949)
const std::string kDomyeon949 = "\xB5\xB5\xB8\xE9"; // 도면

const LeadByteTable& CodePage(unsigned cp) {
    static const LeadByteTable t932 = LeadBytesOfCodePage(932), t936 = LeadBytesOfCodePage(936),
                               t949 = LeadBytesOfCodePage(949), t950 = LeadBytesOfCodePage(950),
                               t1252 = LeadBytesOfCodePage(1252);
    switch (cp) {
    case 932:
        return t932;
    case 936:
        return t936;
    case 949:
        return t949;
    case 950:
        return t950;
    default:
        return t1252;
    }
}

TEST(LeadBytes, EachCodePageHasItsRanges) {
    const LeadByteTable& sjis = CodePage(932);
    EXPECT_FALSE(sjis.lead[0x80]);
    EXPECT_TRUE(sjis.lead[0x81]);
    EXPECT_TRUE(sjis.lead[0x9F]);
    EXPECT_FALSE(sjis.lead[0xA0]);
    EXPECT_FALSE(sjis.lead[0xB6]); // half-width katakana
    EXPECT_FALSE(sjis.lead[0xDF]);
    EXPECT_TRUE(sjis.lead[0xE0]);
    EXPECT_TRUE(sjis.lead[0xFC]);
    EXPECT_FALSE(sjis.lead[0xFD]);
    for (unsigned cp : {936u, 949u, 950u}) {
        const LeadByteTable& table = CodePage(cp);
        EXPECT_FALSE(table.lead[0x80]) << cp;
        EXPECT_TRUE(table.lead[0x81]) << cp;
        EXPECT_TRUE(table.lead[0xFE]) << cp;
        EXPECT_FALSE(table.lead[0xFF]) << cp;
    }
    for (int c = 0; c < 256; ++c) {
        EXPECT_FALSE(CodePage(1252).lead[c]) << c;
        if (c < 0x80) {
            for (unsigned cp : {932u, 936u, 949u, 950u})
                EXPECT_FALSE(CodePage(cp).lead[c]) << cp << " " << c;
        }
    }
}

TEST(NarrowText, CountsCharactersNotBytes) {
    EXPECT_EQ(CharacterCount(kSofuto932 + ".dwg", CodePage(932)), 7u);
    EXPECT_EQ(CharacterCount(kHalfKa932 + kHyo932, CodePage(932)), 2u);
    EXPECT_EQ(CharacterCount(kKyoKoGai950, CodePage(950)), 3u);
    EXPECT_EQ(CharacterCount(kDomyeon949 + ".dwg", CodePage(949)), 6u);
    EXPECT_EQ(CharacterCount(kUnyu936, CodePage(1252)), 4u); // one byte, one character
    EXPECT_EQ(CharacterCount("", CodePage(932)), 0u);
    // A lead byte at the very end counts as one character.
    EXPECT_EQ(CharacterCount("a\x95", CodePage(932)), 2u);
}

TEST(NarrowText, TrailByteIsNoSeparatorAtTheEnd) {
    EXPECT_FALSE(EndsWithSeparator("C:\\lib\\" + kUn936, CodePage(936)));
    EXPECT_FALSE(EndsWithSeparator("C:\\lib\\" + kKo950, CodePage(950)));
    EXPECT_FALSE(EndsWithSeparator("C:\\lib\\" + kZuhyo932, CodePage(932)));
    EXPECT_TRUE(EndsWithSeparator("C:\\lib\\" + kUn936 + "\\", CodePage(936)));
    EXPECT_TRUE(EndsWithSeparator("C:\\lib/", CodePage(936)));
    EXPECT_FALSE(EndsWithSeparator("", CodePage(936)));
    // In the Western code page the same bytes are two characters, the second a backslash.
    EXPECT_TRUE(EndsWithSeparator("C:\\lib\\" + kUn936, CodePage(1252)));
}

TEST(NarrowText, LastSeparatorSkipsTrailBytes) {
    const std::string path = "C:\\lib\\" + kUn936 + "\\" + kUnyu936 + ".dwg";
    EXPECT_EQ(LastSeparator(path, CodePage(936)), 9u);
    EXPECT_EQ(LastSeparator("C:\\lib\\" + kKyoKoGai950 + ".dwg", CodePage(950)), 6u);
    EXPECT_EQ(LastSeparator(kHyo932 + "\x8E\xA6.dwg", CodePage(932)), std::string::npos);
    EXPECT_EQ(LastSeparator("a/b", CodePage(932)), 1u);
    EXPECT_EQ(LastCharacterOf("C:" + kSo932, "\\/:", CodePage(932)), 1u);
    EXPECT_EQ(LastCharacterOf(kPo932 + "a", "|", CodePage(932)), std::string::npos);
    EXPECT_EQ(LastCharacterOf(kPo932 + "a", "|", CodePage(1252)), 1u);
}

TEST(NarrowText, FindCharacterSkipsTrailBytes) {
    const std::string path = "D:\\" + kSofuto932 + "\\x";
    EXPECT_EQ(FindCharacter(path, '\\', 3, CodePage(932)), 9u);
    EXPECT_EQ(FindCharacter(path, '\\', 3, CodePage(1252)), 4u);
    EXPECT_EQ(FindCharacter(kTo936, '|', 0, CodePage(936)), std::string::npos);
}

TEST(NarrowText, WithSeparatorAddsOneAfterATrailByte) {
    EXPECT_EQ(WithSeparator("C:\\lib\\" + kKo950, CodePage(950)), "C:\\lib\\" + kKo950 + "\\");
    EXPECT_EQ(WithSeparator("C:\\lib\\" + kUn936, CodePage(936)), "C:\\lib\\" + kUn936 + "\\");
    EXPECT_EQ(WithSeparator("C:\\lib\\" + kZuhyo932, CodePage(932)), "C:\\lib\\" + kZuhyo932 + "\\");
    EXPECT_EQ(WithSeparator("C:\\lib\\", CodePage(932)), "C:\\lib\\");
    EXPECT_EQ(WithSeparator("C:\\lib/", CodePage(932)), "C:\\lib/");
    EXPECT_EQ(WithSeparator("", CodePage(932)), "");
}

TEST(NarrowText, SplitLabelPathKeepsNamesWhole) {
    const auto names =
        SplitLabelPath("Desktop\\My Computer\\(C:)\\" + kSofuto932 + "\\" + kNo932 + "\\", CodePage(932));
    ASSERT_EQ(names.size(), 6u);
    EXPECT_EQ(names[0], "Desktop");
    EXPECT_EQ(names[1], "My Computer");
    EXPECT_EQ(names[2], "(C:)");
    EXPECT_EQ(names[3], kSofuto932);
    EXPECT_EQ(names[4], kNo932);
    EXPECT_EQ(names[5], "");
    EXPECT_EQ(SplitLabelPath("", CodePage(932)), std::vector<std::string>{""});
    EXPECT_EQ(SplitLabelPath("a", CodePage(932)), std::vector<std::string>{"a"});
    EXPECT_EQ(SplitLabelPath("a\\\\b", CodePage(932)), (std::vector<std::string>{"a", "", "b"}));
}

TEST(NarrowText, ForbiddenCharactersAreWholeCharacters) {
    for (const std::string& name : {kHyo932, kSo932, kNo932, kPo932})
        EXPECT_FALSE(ContainsForbiddenCharacter(name + ".dwg", CodePage(932))) << name;
    EXPECT_FALSE(ContainsForbiddenCharacter(kUn936 + kTo936 + ".dwg", CodePage(936)));
    EXPECT_FALSE(ContainsForbiddenCharacter(kKyoKoGai950 + ".dwg", CodePage(950)));
    EXPECT_FALSE(ContainsForbiddenCharacter(kDomyeon949 + ".dwg", CodePage(949)));
    for (const char* bad : {"a\\b", "a/b", "a:b", "a*b", "a?b", "a\"b", "a<b", "a>b", "a|b", "a\tb", "a\x7F"})
        EXPECT_TRUE(ContainsForbiddenCharacter(bad, CodePage(932))) << bad;
    EXPECT_TRUE(ContainsForbiddenCharacter(kSo932 + "|", CodePage(932)));
    EXPECT_TRUE(ContainsForbiddenCharacter(kSo932 + ".dwg", CodePage(1252)));
}

TEST(NarrowText, CharacterStartsAndNext) {
    const std::string text = "a" + kSo932 + kHalfKa932 + "b";
    EXPECT_EQ(CharacterStarts(text, CodePage(932)), (std::vector<std::size_t>{0, 1, 3, 4}));
    EXPECT_EQ(NextCharacter(text, 1, CodePage(932)), 3u);
    EXPECT_EQ(NextCharacter(text, 5, CodePage(932)), 5u);
    EXPECT_EQ(NextCharacter("\x83", 0, CodePage(932)), 1u);
}

TEST(NarrowText, ActiveCodePageHasNoLeadBytesHere) {
    // Native builds stand in for the ANSI code page with the Western one; Windows asks the system.
#ifndef _WIN32
    for (int c = 0; c < 256; ++c)
        EXPECT_FALSE(ActiveLeadBytes().lead[c]) << c;
#endif
    EXPECT_EQ(CharacterCount("abc"), 3u);
}

} // namespace

namespace {

TEST(NarrowText, LengthsForMessages) {
    EXPECT_EQ(CharactersAndBytes("C:\\dwg", LeadBytesOfCodePage(932)), "6 characters");
    EXPECT_EQ(CharactersAndBytes("C:\\\x83\x5C\x83\x74\x83\x67", LeadBytesOfCodePage(932)),
              "6 characters, 9 bytes");
    EXPECT_EQ(CharactersAndBytes("C:\\\x83\x5C\x83\x74\x83\x67", LeadBytesOfCodePage(1252)), "9 characters");
    // A limit of bytes is said in bytes beside a text of double-byte characters, else in characters.
    EXPECT_STREQ(ByteLimitUnit("C:\\dwg", LeadBytesOfCodePage(932)), "characters");
    EXPECT_STREQ(ByteLimitUnit("C:\\\x83\x5C", LeadBytesOfCodePage(932)), "bytes");
    EXPECT_STREQ(ByteLimitUnit("C:\\\x83\x5C", LeadBytesOfCodePage(1252)), "characters");
    EXPECT_STREQ(ByteLimitUnit(""), "characters");
}

// The longest word of text (a run without blanks or line breaks), in characters: a message box wraps at
// blanks, not inside a word.
std::size_t LongestWord(const std::string& text, const LeadByteTable& lead) {
    std::size_t longest = 0, line = 0;
    for (std::size_t i = 0; i < text.size(); i = NextCharacter(text, i, lead)) {
        line = text[i] == '\n' || text[i] == ' ' ? 0 : line + 1;
        longest = std::max(longest, line);
    }
    return longest;
}

TEST(NarrowText, ALongWordIsBrokenIntoLinesThatKeepEveryCharacter) {
    const std::string name = std::string(296, 'n') + ".dwg";
    const std::string text = "Cannot rename to \"" + name + "\": the full path would be too long.";
    const std::string broken = BreakLongWords(text, 64, CodePage(1252));
    EXPECT_LE(LongestWord(broken, CodePage(1252)), 64u);
    std::string joined = broken;
    joined.erase(std::remove(joined.begin(), joined.end(), '\n'), joined.end());
    EXPECT_EQ(joined, text);
    // Short words and the line breaks already there are left alone.
    EXPECT_EQ(BreakLongWords("The drawing\nC:\\a.dwg\nno longer exists.", 64, CodePage(1252)),
              "The drawing\nC:\\a.dwg\nno longer exists.");
    EXPECT_EQ(BreakLongWords(std::string(64, 'x'), 64, CodePage(1252)), std::string(64, 'x'));
    EXPECT_EQ(BreakLongWords(std::string(65, 'x'), 64, CodePage(1252)), std::string(64, 'x') + "\nx");
}

TEST(NarrowText, ALongPathIsBrokenAfterABackslash) {
    std::string path = "C:";
    for (int i = 0; i < 30; ++i)
        path += "\\folder" + std::to_string(i);
    const std::string broken = BreakLongWords(path, 40, CodePage(1252));
    EXPECT_LE(LongestWord(broken, CodePage(1252)), 40u);
    for (std::size_t at = broken.find('\n'); at != std::string::npos; at = broken.find('\n', at + 1))
        EXPECT_EQ(broken[at - 1], '\\') << broken;
}

TEST(NarrowText, ALongWordOfDoubleByteCharactersIsBrokenBetweenCharacters) {
    // 表 ends in the byte of "\": a break after it would be a break inside the character before.
    std::string word;
    for (int i = 0; i < 50; ++i)
        word += kHyo932;
    const std::string broken = BreakLongWords(word, 20, CodePage(932));
    EXPECT_EQ(broken.size(), word.size() + 2);
    for (std::size_t at = broken.find('\n'); at != std::string::npos; at = broken.find('\n', at + 1))
        EXPECT_EQ(at % 41, 40u) << at; // 20 characters of two bytes, then the break
}

TEST(NarrowText, UnicodeTextIsBrokenTheSameWay) {
    const std::wstring name(300, L'n');
    const std::wstring broken = BreakLongWords(L"Cannot paste:\n" + name, 64);
    EXPECT_EQ(broken, L"Cannot paste:\n" + std::wstring(64, L'n') + L"\n" + std::wstring(64, L'n') + L"\n" +
                          std::wstring(64, L'n') + L"\n" + std::wstring(64, L'n') + L"\n" +
                          std::wstring(44, L'n'));
}

} // namespace

#ifdef _WIN32
#include <windows.h>

namespace {

// Run in each locale (ctest orvex_hostapi_tests_cpNNN): the tables written here are the system's own.
TEST(NarrowText, ActiveLeadBytesAreTheSystemsCodePage) {
    const unsigned acp = ::GetACP();
    const LeadByteTable written = LeadBytesOfCodePage(acp);
    for (int c = 0; c < 256; ++c) {
        EXPECT_EQ(ActiveLeadBytes().lead[c], ::IsDBCSLeadByteEx(acp, static_cast<BYTE>(c)) != FALSE)
            << acp << " " << c;
        EXPECT_EQ(written.lead[c], ActiveLeadBytes().lead[c]) << acp << " " << c;
    }
}

} // namespace
#endif
