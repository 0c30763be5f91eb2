#include "thumbs/TooltipText.h"

#include "hostapi/NarrowText.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

std::tm March5() {
    std::tm t{};
    t.tm_year = 2021 - 1900;
    t.tm_mon = 2;
    t.tm_mday = 5;
    t.tm_hour = 14;
    t.tm_min = 7;
    t.tm_sec = 9;
    return t;
}

TEST(TooltipText, SizeAndDateTexts) {
    const std::tm t = March5();
    EXPECT_EQ(TooltipSizeText(1234), "Size=1234 ");
    EXPECT_EQ(TooltipDateText(&t), "05/03/2021;14.07.09");
}

TEST(TooltipText, SizesOfTwoGibibytesAndMoreAreUnsignedSixtyFourBit) {
    EXPECT_EQ(TooltipSizeText(2147483647u), "Size=2147483647 ");
    EXPECT_EQ(TooltipSizeText(2147483648u), "Size=2147483648 "); // 2 GiB
    EXPECT_EQ(TooltipSizeText(3221225472u), "Size=3221225472 "); // 3 GiB
    EXPECT_EQ(TooltipSizeText(4294967295u), "Size=4294967295 ");
    EXPECT_EQ(TooltipSizeText(4294967296ull), "Size=4294967296 "); // 4 GiB
    EXPECT_EQ(TooltipSizeText(5368709120ull), "Size=5368709120 "); // 5 GiB
    EXPECT_EQ(TooltipSizeText(18446744073709551615ull), "Size=18446744073709551615 ");
}

TEST(TooltipText, FiveGibibyteDrawingTooltip) {
    const std::tm t = March5();
    const ThumbTooltip tip = BuildTooltip("huge.dwg", 5368709120ull, &t);
    EXPECT_EQ(tip.sizeText, "Size=5368709120 ");
    EXPECT_EQ(tip.width, 19);
    EXPECT_EQ(tip.text, "huge.dwg            "
                        "Size=5368709120    "
                        "05/03/2021;14.07.09");
}

TEST(TooltipText, FailedConversion) {
    EXPECT_EQ(TooltipDateText(nullptr), "00/00/   0;-1.-1.-1");
}

TEST(TooltipText, ShortNamePaddedToLongestText) {
    const std::tm t = March5();
    const ThumbTooltip tip = BuildTooltip("a.dwg", 1234, &t);
    EXPECT_EQ(tip.width, 19);
    EXPECT_EQ(tip.text, "a.dwg               "
                        "Size=1234          "
                        "05/03/2021;14.07.09");
    EXPECT_EQ(tip.text.size(), 19u * 3 + 1);
}

TEST(TooltipText, LongNameSetsWidth) {
    const std::tm t = March5();
    const std::string name = "a-rather-long-drawing-name.dwg"; // 30 characters
    const ThumbTooltip tip = BuildTooltip(name, 7, &t);
    EXPECT_EQ(tip.width, 30);
    EXPECT_EQ(tip.text,
              name + " " + "Size=7 " + std::string(23, ' ') + "05/03/2021;14.07.09" + std::string(11, ' '));
}

TEST(TooltipText, FromWriteTimeUsesLocalTime) {
    // 2021-03-05 14:07:09 in a zone without daylight saving, one hour east of UTC.
#ifdef _WIN32
    _putenv("TZ=CET-1");
    _tzset();
#else
    setenv("TZ", "CET-1", 1);
    tzset();
#endif
    const ThumbTooltip tip = BuildTooltipForTime("x.dwg", 1234, 1614949629);
    EXPECT_EQ(tip.dateText, "05/03/2021;14.07.09");
    EXPECT_EQ(tip.sizeText, "Size=1234 ");
}

} // namespace

TEST(TooltipText, PixelWidthIsTheWidestLineInTheFont) {
    std::tm local{};
    local.tm_year = 2021 - 1900;
    local.tm_mon = 2;
    local.tm_mday = 5;
    local.tm_hour = 14;
    local.tm_min = 7;
    local.tm_sec = 9;
    const ThumbTooltip tip = BuildTooltip("a.dwg", 1234, &local);
    // A font whose characters are all 7 pixels wide: the name's line (padded to 19 characters, and the
    // blank before the size) is the widest.
    const auto fixed = [](const std::string& text) { return static_cast<int>(text.size()) * 7; };
    EXPECT_EQ(TooltipPixelWidth(tip, fixed), 20 * 7);
    // A font with narrow blanks: the date text, which has none, is the widest line.
    const auto narrowBlanks = [](const std::string& text) {
        int width = 0;
        for (const char c : text)
            width += c == ' ' ? 2 : 7;
        return width;
    };
    EXPECT_EQ(TooltipPixelWidth(tip, narrowBlanks), 19 * 7);
    EXPECT_EQ(TooltipPixelWidth(tip, nullptr), 0);
}

TEST(TooltipText, JapaneseNameCountsCharactersAndSetsTheWidth) {
    const LeadByteTable sjis = LeadBytesOfCodePage(932);
    std::string name;
    for (int i = 0; i < 10; ++i)
        name += "\x83\x5C"; // ten katakana So, the second byte a backslash
    std::tm local{};
    local.tm_year = 2021 - 1900;
    local.tm_mday = 1;
    const ThumbTooltip tip = BuildTooltip(name + "-plan.dwg", 1234, &local, sjis);
    EXPECT_EQ(tip.width, 19) << "19 characters, 29 bytes: the date is as long";
    EXPECT_EQ(tip.lines[0], name + "-plan.dwg "); // no blank but the one before the size
    EXPECT_EQ(tip.text, tip.lines[0] + "Size=1234          01/01/2021;00.00.00");
    // A Japanese font: 12 pixels for a double-byte character, 7 for any other; the name's line is widest.
    const auto japanese = [&sjis](const std::string& text) {
        int width = 0;
        for (std::size_t i = 0; i < text.size();) {
            const std::size_t next = NextCharacter(text, i, sjis);
            width += next - i == 2 ? 12 : 7;
            i = next;
        }
        return width;
    };
    EXPECT_EQ(TooltipPixelWidth(tip, japanese), 10 * 12 + 10 * 7);
}

namespace {

// Every character 7 pixels wide, a W 11, a blank 3.
int FakeWidth(const std::string& text) {
    int width = 0;
    for (const char c : text)
        width += c == ' ' ? 3 : (c == 'W' || c == 'w') ? 11 : 7;
    return width;
}

std::tm SomeTime() {
    std::tm local{};
    local.tm_year = 2021 - 1900;
    local.tm_mon = 2;
    local.tm_mday = 5;
    return local;
}

} // namespace

TEST(TooltipShownText, NameSizeAndDateOnLinesOfTheirOwnWhateverTheirWidths) {
    // A name of wide letters is wider than the blanks that pad the size text to its length.
    const std::tm local = SomeTime();
    const ThumbTooltip tip = BuildTooltip(std::string(40, 'w') + ".dwg", 1234, &local);
    const int width = TooltipWidthFor(tip, 1000, FakeWidth);
    EXPECT_EQ(width, 41 * 11 + 3 * 7 + 3); // the name (".dwg" holds a w too) and a blank
    EXPECT_EQ(TooltipShownText(tip, width, FakeWidth),
              std::string(40, 'w') + ".dwg\r\nSize=1234\r\n05/03/2021;00.00.00");
}

TEST(TooltipShownText, ANameWiderThanTheScreenIsCutIntoLinesThatFit) {
    const std::tm local = SomeTime();
    const std::string name = std::string(200, 'W') + ".dwg";
    const ThumbTooltip tip = BuildTooltip(name, 1, &local);
    const int width = TooltipWidthFor(tip, 1000, FakeWidth);
    EXPECT_EQ(width, 1000);
    const std::string text = TooltipShownText(tip, width, FakeWidth);
    std::string joined;
    std::size_t lines = 0;
    for (std::size_t from = 0;;) {
        const std::size_t end = text.find("\r\n", from);
        const std::string line = text.substr(from, end == std::string::npos ? std::string::npos : end - from);
        EXPECT_LE(FakeWidth(line), width - 3) << line;
        ++lines;
        if (end == std::string::npos)
            break;
        if (lines <= 3)
            joined += line;
        from = end + 2;
    }
    EXPECT_EQ(lines, 5u); // 2,200 pixels of name in lines of 997: three, then the size and the date
    EXPECT_EQ(joined, name);
}

TEST(TooltipShownText, ADoubleByteNameIsCutBetweenCharacters) {
    const std::tm local = SomeTime();
    std::string name;
    for (int i = 0; i < 30; ++i)
        name += "\x95\x5C"; // 表: its second byte is a backslash
    const ThumbTooltip tip = BuildTooltip(name, 1, &local, LeadBytesOfCodePage(932));
    const auto measure = [](const std::string& text) { return static_cast<int>(text.size()) * 5; };
    const std::string text = TooltipShownText(tip, 100, measure, LeadBytesOfCodePage(932));
    const std::string first = text.substr(0, text.find("\r\n"));
    EXPECT_EQ(first.size() % 2, 0u) << "cut inside a character";
    EXPECT_LE(static_cast<int>(first.size()) * 5, 100);
}
