// A folder's insertion parameters: what the folder settings dialog shows on opening, what Accept does,
// the order and form of what it writes, and the path buffer's limit.
#include "settings/FolderSettings.h"
#include "settings/IniFile.h"

#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <string>

using namespace testsupport;

namespace {

// A store that read the given file contents.
struct ReadStore {
    TempFolder folder{"orvex-folderset"};
    CIniFile store;
    bool read = false;
    explicit ReadStore(const std::string& bytes) {
        store.SetPath(folder.Write("datains.ini", bytes));
        read = store.ReadFile();
    }
};

} // namespace

TEST(FolderSettingsPath, AlwaysAddsTheSeparator) {
    EXPECT_EQ(FolderSettingsFilePath("C:\\dwg"), "C:\\dwg\\datains.ini");
    EXPECT_EQ(FolderSettingsFilePath("C:\\"), "C:\\\\datains.ini");
}

TEST(FolderSettingsPath, FitsTheBufferWithItsTerminator) {
    // "\datains.ini" is 12 characters: a folder of 247 makes 259, the most the 260-character buffer holds.
    EXPECT_TRUE(FolderSettingsPathFits(std::string(247, 'a')));
    EXPECT_FALSE(FolderSettingsPathFits(std::string(248, 'a')));
    EXPECT_FALSE(FolderSettingsPathFits(std::string(5000, 'a')));
    EXPECT_TRUE(FolderSettingsPathFits(""));
}

TEST(FolderSettingsPath, TheRefusalSaysHowLongAndWhichFolder) {
    const std::string folder = "C:\\" + std::string(300, 'd');
    const std::string message = FolderPathTooLongMessage(folder);
    EXPECT_NE(message.find("315 characters"), std::string::npos) << message;
    EXPECT_NE(message.find("at most 259"), std::string::npos) << message;
    EXPECT_NE(message.find(folder), std::string::npos);
}

TEST(FolderSettingsView, NoFileChecksTheBoxAndLeavesTheSwatchEnabled) {
    CIniFile store;
    const FolderSettingsView view = ReadFolderSettingsView(store, false);
    EXPECT_TRUE(view.useCurrentLayer);
    EXPECT_FALSE(view.layerEditEnabled);
    EXPECT_TRUE(view.swatchEnabled);
    EXPECT_FALSE(view.colorFromFile);
    EXPECT_EQ(view.colorIndex, 7);
    EXPECT_EQ(view.layer, "");
    EXPECT_EQ(view.command, "");
}

TEST(FolderSettingsView, AnEmptyLayerChecksTheBoxAndDisablesLayerAndSwatch) {
    ReadStore file("[Default Parameters]\r\nLayer=\r\nLisp command=(c:go)\r\nColor=3\r\n");
    ASSERT_TRUE(file.read);
    const FolderSettingsView view = ReadFolderSettingsView(file.store, true);
    EXPECT_TRUE(view.useCurrentLayer);
    EXPECT_FALSE(view.layerEditEnabled);
    EXPECT_FALSE(view.swatchEnabled);
    EXPECT_FALSE(view.colorFromFile);
    EXPECT_EQ(view.command, "(c:go)");
}

TEST(FolderSettingsView, ALayerShowsLayerColourAndCommand) {
    ReadStore file("[Default Parameters]\r\nLayer=WALLS\r\nLisp command=(c:fix)\r\nColor=30\r\n");
    const FolderSettingsView view = ReadFolderSettingsView(file.store, true);
    EXPECT_FALSE(view.useCurrentLayer);
    EXPECT_TRUE(view.layerEditEnabled);
    EXPECT_TRUE(view.swatchEnabled);
    EXPECT_TRUE(view.colorFromFile);
    EXPECT_EQ(view.colorIndex, 30);
    EXPECT_EQ(view.layer, "WALLS");
    EXPECT_EQ(view.command, "(c:fix)");
}

TEST(FolderSettingsView, AMissingColourReadsAsZero) {
    ReadStore file("[Default Parameters]\r\nLayer=WALLS\r\n");
    const FolderSettingsView view = ReadFolderSettingsView(file.store, true);
    EXPECT_TRUE(view.colorFromFile);
    EXPECT_EQ(view.colorIndex, 0);
    EXPECT_EQ(view.command, "");
}

TEST(FolderSettingsView, AColourOutsideThePaletteReadsAsAMissingOne) {
    for (const char* color : {"999", "-5", "256", "99999999999", "abc"}) {
        ReadStore file(std::string("[Default Parameters]\r\nLayer=WALLS\r\nColor=") + color + "\r\n");
        EXPECT_EQ(ReadFolderSettingsView(file.store, true).colorIndex, 0) << color;
    }
    ReadStore file("[Default Parameters]\r\nLayer=WALLS\r\nColor=255\r\n");
    EXPECT_EQ(ReadFolderSettingsView(file.store, true).colorIndex, 255);
}

TEST(FolderSettingsAccept, TheRulesInTheirOrder) {
    using A = FolderSettingsAction;
    EXPECT_EQ(DecideFolderSettingsAccept(true, "", ""), A::DeleteFile);
    EXPECT_EQ(DecideFolderSettingsAccept(true, "WALLS", ""), A::DeleteFile); // the layer edit is not read
    EXPECT_EQ(DecideFolderSettingsAccept(true, "", "(c:go)"), A::Write);
    EXPECT_EQ(DecideFolderSettingsAccept(false, "", "(c:go)"), A::AskLayer);
    EXPECT_EQ(DecideFolderSettingsAccept(false, "", ""), A::AskLayer);
    EXPECT_EQ(DecideFolderSettingsAccept(false, "WALLS", ""), A::Write);
    EXPECT_EQ(std::string(kLayerNameEmptyAlert), "Name of layer is empty");
}

TEST(FolderSettingsAccept, TextsLongerThanTheFileReadsBackAreRefused) {
    using A = FolderSettingsAction;
    // "Lisp command=" and "Layer=" with their values fill at most the reader's line.
    EXPECT_EQ(MaxFolderCommandChars(), kMaxIniLineChars - 13);
    EXPECT_EQ(MaxFolderLayerChars(), kMaxIniLineChars - 6);
    const std::string longest(static_cast<std::size_t>(MaxFolderCommandChars()), 'c');
    EXPECT_EQ(DecideFolderSettingsAccept(true, "", longest), A::Write);
    EXPECT_EQ(DecideFolderSettingsAccept(true, "", longest + "c"), A::CommandTooLong);
    EXPECT_EQ(DecideFolderSettingsAccept(false, "WALLS", std::string(2158, 'c')), A::CommandTooLong);
    const std::string layer(static_cast<std::size_t>(MaxFolderLayerChars()), 'L');
    EXPECT_EQ(DecideFolderSettingsAccept(false, layer, "(c:go)"), A::Write);
    EXPECT_EQ(DecideFolderSettingsAccept(false, layer + "L", "(c:go)"), A::LayerTooLong);
    EXPECT_EQ(DecideFolderSettingsAccept(true, layer + "L", ""), A::DeleteFile)
        << "the layer edit is not read";
    EXPECT_EQ(
        CommandTooLongAlert(std::string(2158, 'c')),
        "The LISP command is 2158 characters long; the folder's settings hold at most 2034. Shorten it, "
        "then Accept again.");
    EXPECT_EQ(CommandLimitNote(), "The command holds at most 2034 characters; the rest was not taken.");
}

TEST(FolderSettingsWrite, TheLongestCommandReadsBackWithItsColour) {
    TempFolder folder("orvex-folderset");
    CIniFile store;
    const std::string path = folder.File("datains.ini");
    const std::string command(static_cast<std::size_t>(MaxFolderCommandChars()), 'c');
    ASSERT_TRUE(WriteFolderSettings(store, path, "LONG", command, 5));
    CIniFile again(path);
    ASSERT_TRUE(again.ReadFile());
    const FolderSettingsView view = ReadFolderSettingsView(again, true);
    EXPECT_EQ(view.layer, "LONG");
    EXPECT_EQ(view.command, command);
    EXPECT_EQ(view.colorIndex, 5);
}

TEST(FolderSettingsWrite, ThreeKeysInOrderAfterWhatTheFileHad) {
    ReadStore file("[Other]\r\nKeep=1\r\n[Default Parameters]\r\nColor=5\r\nExtra=x\r\n");
    ASSERT_TRUE(file.read);
    const std::string path = file.folder.File("datains.ini");
    ASSERT_TRUE(WriteFolderSettings(file.store, path, "WALLS", "(c:go)", 7));
    // Color was there already and keeps its place; Layer and Lisp command are added in that order.
    EXPECT_EQ(ReadBytes(path), "[Other]\r\nKeep=1\r\n\r\n[Default Parameters]\r\nColor=7\r\nExtra=x\r\n"
                               "Layer=WALLS\r\nLisp command=(c:go)\r\n\r\n");
}

TEST(FolderSettingsWrite, ANewFileHoldsLayerCommandColour) {
    TempFolder folder("orvex-folderset");
    CIniFile store;
    const std::string path = folder.File("datains.ini");
    ASSERT_TRUE(WriteFolderSettings(store, path, "", "(c:go)", 7));
    EXPECT_EQ(ReadBytes(path), "[Default Parameters]\r\nLayer=\r\nLisp command=(c:go)\r\nColor=7\r\n\r\n");
    CIniFile again(path);
    ASSERT_TRUE(again.ReadFile());
    EXPECT_EQ(again.GetValue("Default Parameters", "Color"), "7");
}

TEST(FolderSettingsWrite, TheColourIsDecimal) {
    TempFolder folder("orvex-folderset");
    CIniFile store;
    const std::string path = folder.File("datains.ini");
    ASSERT_TRUE(WriteFolderSettings(store, path, "A", "", 255));
    EXPECT_EQ(ReadBytes(path), "[Default Parameters]\r\nLayer=A\r\nLisp command=\r\nColor=255\r\n\r\n");
}
