#include "thumbs/TooltipText.h"

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
