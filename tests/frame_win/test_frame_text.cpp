// The frame's arithmetic and texts: placement, start folder, search text, title, help file.
#include "frame/MainFrame.h"
#include "frame/MdiMixin.h"

#include <gtest/gtest.h>

TEST(EditingKeys, TheKeysAnEditBoxUsesOnItsText) {
    for (UINT vk : {UINT('A'), UINT('C'), UINT('X'), UINT('V'), UINT('Z'), UINT(VK_INSERT)})
        EXPECT_TRUE(IsEditingKey(vk, true, false, false)) << vk;
    EXPECT_TRUE(IsEditingKey(VK_INSERT, false, true, false));
    EXPECT_TRUE(IsEditingKey(VK_DELETE, false, true, false));
    EXPECT_TRUE(IsEditingKey(VK_DELETE, false, false, false));
    EXPECT_TRUE(IsEditingKey(VK_BACK, false, false, true));
    // The explorer's own keys stay the frame's.
    EXPECT_FALSE(IsEditingKey(VK_F6, false, false, false));
    EXPECT_FALSE(IsEditingKey('N', true, false, false));
    EXPECT_FALSE(IsEditingKey('A', true, true, false));
    EXPECT_FALSE(IsEditingKey('A', false, false, false));
}

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

TEST(FramePlacement, StoredSizeMustFitTheDesktop) {
    const RECT screen{0, 0, 1600, 1000};
    EXPECT_TRUE(StoredSizeUsable(400, 300, screen));
    EXPECT_TRUE(StoredSizeUsable(1600, 1000, screen));
    EXPECT_FALSE(StoredSizeUsable(1601, 300, screen));
    EXPECT_FALSE(StoredSizeUsable(400, 1001, screen));
    EXPECT_FALSE(StoredSizeUsable(0, 300, screen));
    EXPECT_FALSE(StoredSizeUsable(-400, 300, screen));
    EXPECT_FALSE(StoredSizeUsable(400, -1, screen));
    EXPECT_FALSE(StoredSizeUsable(2147483647, 2147483647, screen));
    EXPECT_FALSE(StoredSizeUsable(-2147483647 - 1, 300, screen));
}

TEST(FramePlacement, AFrameClosedMaximisedOpensMaximisedAgain) {
    // Its rectangle was the screen and 4 pixels of border on each side; the run dialog sits, shrunk to
    // nothing, at the screen's centre. Before, the size was taken as too large for the desktop and the
    // frame opened at its created size.
    const RECT screen{0, 0, 1600, 1000};
    const RECT dialog{800, 500, 800, 500};
    auto everywhere = [](const RECT&) { return true; };
    const FramePlacement place = PlaceFrameOnDesktop(dialog, 1608, 1008, screen, everywhere, SIZE{4, 4});
    EXPECT_TRUE(place.maximised);
    EXPECT_FALSE(place.move);
    // Exactly the screen, too; the borders of a larger frame setting as well.
    EXPECT_TRUE(PlaceFrameOnDesktop(dialog, 1600, 1000, screen, everywhere, SIZE{4, 4}).maximised);
    EXPECT_TRUE(PlaceFrameOnDesktop(dialog, 1616, 1016, screen, everywhere, SIZE{8, 8}).maximised);
    // More than the borders: a size no screen here shows, placed as on a first run.
    const FramePlacement firstRun = PlaceFrame(dialog, 0, 0);
    for (const FramePlacement& other :
         {PlaceFrameOnDesktop(dialog, 1609, 1008, screen, everywhere, SIZE{4, 4}),
          PlaceFrameOnDesktop(dialog, 2147483647, 2147483647, screen, everywhere, SIZE{4, 4})}) {
        EXPECT_EQ(other.maximised, firstRun.maximised);
        EXPECT_EQ(other.move, firstRun.move);
    }
    // The host's window off the screen's centre: the run dialog's place gives x > 0, but a size that
    // covers the screen is still a maximised frame's.
    const RECT offCentre{1300, 700, 1300, 700};
    EXPECT_FALSE(PlaceFrame(offCentre, 1608, 1008).maximised);
    EXPECT_TRUE(PlaceFrameOnDesktop(offCentre, 1608, 1008, screen, everywhere, SIZE{4, 4}).maximised);
    EXPECT_FALSE(PlaceFrameOnDesktop(offCentre, 1599, 1008, screen, everywhere, SIZE{4, 4}).maximised);
    // A normal frame keeps its place and size.
    const FramePlacement normal = PlaceFrameOnDesktop(dialog, 1200, 750, screen, everywhere, SIZE{4, 4});
    EXPECT_FALSE(normal.maximised);
    EXPECT_TRUE(normal.move);
    EXPECT_EQ(normal.x, 200);
    EXPECT_EQ(normal.width, 1200);
}

TEST(FramePlacement, OnTheDesktopACaptionOnNoMonitorGivesTheFirstRunPlacement) {
    const RECT screen{0, 0, 1600, 1000};
    const RECT dialog{300, 200, 500, 300};
    auto everywhere = [](const RECT&) { return true; };
    auto nowhere = [](const RECT&) { return false; };
    const FramePlacement kept = PlaceFrameOnDesktop(dialog, 400, 300, screen, everywhere);
    EXPECT_TRUE(kept.move);
    EXPECT_EQ(kept.x, 200);
    EXPECT_EQ(kept.width, 400);
    EXPECT_EQ(kept.height, 300);
    const FramePlacement firstRun = PlaceFrame(dialog, 0, 0);
    for (const FramePlacement& place :
         {PlaceFrameOnDesktop(dialog, 400, 300, screen, nowhere),
          PlaceFrameOnDesktop(dialog, -400, 300, screen, everywhere),
          PlaceFrameOnDesktop(dialog, 400, 3000, screen, everywhere),
          PlaceFrameOnDesktop(dialog, 2147483647, 2147483647, screen, everywhere)}) {
        EXPECT_EQ(place.move, firstRun.move);
        EXPECT_EQ(place.maximised, firstRun.maximised);
        EXPECT_EQ(place.x, firstRun.x);
        EXPECT_EQ(place.y, firstRun.y);
    }
    // The caption asked about is the frame's top left.
    RECT asked{};
    PlaceFrameOnDesktop(dialog, 400, 300, screen, [&asked](const RECT& rc) { return asked = rc, true; });
    EXPECT_EQ(asked.left, 200);
    EXPECT_EQ(asked.top, kept.y);
    EXPECT_GT(asked.right, asked.left);
    EXPECT_GT(asked.bottom, asked.top);
}

TEST(FramePlacement, HugeValuesDoNotOverflow) {
    const FramePlacement place =
        PlaceFrame(RECT{2000000000, 2000000000, 2100000000, 2100000000}, -2147483647 - 1, -2147483647 - 1);
    EXPECT_GE(place.x, 0);
    EXPECT_GE(place.y, 0);
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
    EXPECT_EQ(SearchTextOf("C:plan"), "plan");
    EXPECT_EQ(SearchTextOf("D:/a.b/plan"), "plan");
    // Longer than any file-name buffer: taken whole.
    EXPECT_EQ(SearchTextOf("C:\\" + std::string(3000, 'n') + ".dwg"), std::string(3000, 'n'));
}

TEST(StartFolder, LongPathsAreTakenWhole) {
    const std::string folder = "C:\\" + std::string(258, 'd');
    EXPECT_EQ(StartFolder(folder + "\\a.dwg", ""), folder);
    EXPECT_EQ(StartFolder("C:a.dwg", ""), "C:");
    EXPECT_EQ(StartFolder("a.dwg", "D:\\Saved"), "");
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
