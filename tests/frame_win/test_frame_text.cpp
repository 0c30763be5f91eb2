// The frame's arithmetic and texts: placement, start folder, search text, title, help file.
#include "frame/MainFrame.h"
#include "frame/MdiMixin.h"

#include <gtest/gtest.h>

TEST(FramePlacement, CentredDialogAtTheTopLeftWithNoStoredSizeMaximises) {
    const FramePlacement place = PlaceFrame(RECT{0, 0, 0, 0}, 0, 0);
    EXPECT_TRUE(place.maximised);
    EXPECT_FALSE(place.move);
}

TEST(FramePlacement, KeepsTheFormulaThatAddsTheDialogHeight) {
    // Dialog 200 x 100 at (300, 200); stored frame 400 x 300.
    const FramePlacement place = PlaceFrame(RECT{300, 200, 500, 300}, 400, 300);
    EXPECT_FALSE(place.maximised);
    EXPECT_TRUE(place.move);
    EXPECT_EQ(place.x, 400 - 200);
    EXPECT_EQ(place.y, 250 - (300 - 200 + 300) / 2); // 50, not 100
}

TEST(FramePlacement, NegativeValuesClampToZeroAndThenMaximise) {
    const FramePlacement place = PlaceFrame(RECT{100, 100, 200, 150}, 2000, 1500);
    EXPECT_TRUE(place.maximised);
}

TEST(FramePlacement, ClampedXAloneDoesNotMaximise) {
    const FramePlacement place = PlaceFrame(RECT{100, 400, 200, 450}, 2000, 100);
    EXPECT_FALSE(place.maximised);
    EXPECT_EQ(place.x, 0);
    EXPECT_EQ(place.y, 425 - (100 - 400 + 450) / 2);
}

TEST(FramePlacement, NoStoredSizeShowsWithoutMoving) {
    const FramePlacement place = PlaceFrame(RECT{300, 200, 500, 300}, 0, 0);
    EXPECT_FALSE(place.maximised);
    EXPECT_FALSE(place.move);
}

TEST(StartFolder, FolderPartOfTheStartPath) {
    EXPECT_EQ(StartFolder("C:\\Work\\Plans\\a.dwg", "D:\\Saved"), "C:\\Work\\Plans");
    EXPECT_EQ(StartFolder("C:\\Work\\Plans\\", ""), "C:\\Work\\Plans");
    EXPECT_EQ(StartFolder("C:\\a.dwg", ""), "C:\\");
}

TEST(StartFolder, SavedFolderWithoutStartPath) {
    EXPECT_EQ(StartFolder("", "D:\\Saved\\"), "D:\\Saved");
    EXPECT_EQ(StartFolder("", "D:\\Saved"), "D:\\Saved");
    EXPECT_EQ(StartFolder("", ""), "");
}

TEST(SearchText, FileNamePartOnly) {
    EXPECT_EQ(SearchTextOf("plan-a.dwg"), "plan-a");
    EXPECT_EQ(SearchTextOf("C:\\Work\\b.x.dwg"), "b.x");
}

TEST(Title, UntitledBecomesTheProductName) {
    EXPECT_EQ(ExplorerTitle("Untitled - Orvex1"), "Kelmar Dwg Thumbnail Explorer - Orvex1");
    EXPECT_EQ(ExplorerTitle("C:\\Work"), "C:\\Work");
}

TEST(Help, ModulePathWithTheHlpExtension) {
    char module[MAX_PATH] = "";
    ::GetModuleFileNameA(nullptr, module, MAX_PATH);
    std::string expected(module);
    expected = expected.substr(0, expected.rfind('.')) + ".hlp";
    EXPECT_EQ(HelpFilePath(), expected);
}
