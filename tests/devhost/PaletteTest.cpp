#include "devhost/Palette.h"

#include <gtest/gtest.h>

namespace {

TEST(Palette, NamedColours) {
    EXPECT_EQ(devhost::PaletteRgb(1), 0xFF0000u);
    EXPECT_EQ(devhost::PaletteRgb(2), 0xFFFF00u);
    EXPECT_EQ(devhost::PaletteRgb(3), 0x00FF00u);
    EXPECT_EQ(devhost::PaletteRgb(4), 0x00FFFFu);
    EXPECT_EQ(devhost::PaletteRgb(5), 0x0000FFu);
    EXPECT_EQ(devhost::PaletteRgb(6), 0xFF00FFu);
    EXPECT_EQ(devhost::PaletteRgb(7), 0xFFFFFFu);
    EXPECT_EQ(devhost::PaletteRgb(8), 0x808080u);
    EXPECT_EQ(devhost::PaletteRgb(9), 0xC0C0C0u);
}

TEST(Palette, HueTable) {
    EXPECT_EQ(devhost::PaletteRgb(10), 0xFF0000u);
    EXPECT_EQ(devhost::PaletteRgb(11), 0xFF7F7Fu);
    EXPECT_EQ(devhost::PaletteRgb(12), 0xA50000u);
    EXPECT_EQ(devhost::PaletteRgb(19), 0x261313u);
    EXPECT_EQ(devhost::PaletteRgb(20), 0xFF3F00u);
    EXPECT_EQ(devhost::PaletteRgb(30), 0xFF7F00u);
    EXPECT_EQ(devhost::PaletteRgb(50), 0xFFFF00u);
    EXPECT_EQ(devhost::PaletteRgb(90), 0x00FF00u);
    EXPECT_EQ(devhost::PaletteRgb(130), 0x00FFFFu);
    EXPECT_EQ(devhost::PaletteRgb(170), 0x0000FFu);
    EXPECT_EQ(devhost::PaletteRgb(210), 0xFF00FFu);
    EXPECT_EQ(devhost::PaletteRgb(249), 0x261317u);
}

TEST(Palette, Greys) {
    EXPECT_EQ(devhost::PaletteRgb(250), 0x333333u);
    EXPECT_EQ(devhost::PaletteRgb(251), 0x505050u);
    EXPECT_EQ(devhost::PaletteRgb(252), 0x696969u);
    EXPECT_EQ(devhost::PaletteRgb(253), 0x828282u);
    EXPECT_EQ(devhost::PaletteRgb(254), 0xBEBEBEu);
    EXPECT_EQ(devhost::PaletteRgb(255), 0xFFFFFFu);
}

TEST(Palette, ColorRefOrderAndRange) {
    EXPECT_EQ(devhost::PaletteColorRef(1), 0x0000FFu); // 0x00BBGGRR
    EXPECT_EQ(devhost::PaletteColorRef(5), 0xFF0000u);
    EXPECT_EQ(devhost::PaletteColorRef(20), 0x003FFFu);
    EXPECT_EQ(devhost::PaletteRgb(-1), 0u);
    EXPECT_EQ(devhost::PaletteRgb(256), 0u);
    EXPECT_EQ(devhost::PaletteRgb(0), 0u);
}

} // namespace
