#include "FakeHost.h"
#include "host/Orvex.h"
#include "settings/Tessel3Doc.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <memory>
#include <stdexcept>

namespace fs = std::filesystem;

namespace {

// Plays the explorer: "picks" a name in a folder, or cancels.
struct FakePlatform : PickerPlatform {
    fs::path settingsFile;
    int dialogResult = 2;
    std::string pickFolder, pickName;
    std::string shellPathAskedFor;
    std::unique_ptr<CTessel3Doc> doc;
    std::vector<std::string> steps;

    std::string StartShellPath(const std::string& path) override {
        shellPathAskedFor = path;
        return "Desktop\\Computer\\" + path;
    }
    std::string currentFolder = "C:\\Host\\";
    std::string WholeStartPath(const std::string& path) override {
        return path.find(':') == std::string::npos ? currentFolder + path : path;
    }
    int RunDialog() override {
        steps.push_back("dialog");
        doc = std::make_unique<CTessel3Doc>(settingsFile.string());
        doc->m_strPath = pickFolder;
        doc->m_strName = pickName;
        return dialogResult;
    }
    CTessel3Doc* Document() override { return doc.get(); }
    void DestroyDocument() override {
        steps.push_back("destroy");
        doc.reset();
    }
    void FocusHostView() override { steps.push_back("focus"); }
};

struct OrvexTest : ::testing::Test {
    FakeHost host;
    FakePlatform platform;
    testsupport::TempFolder folder;
    const fs::path dir = folder.Path();

    void SetUp() override { platform.settingsFile = dir / "Orvex1.ini"; }

    void FiveArguments(const std::wstring& path = L"", const std::wstring& ok = L"",
                       const std::wstring& cancel = L"") {
        host.AddShort(1);
        host.AddShort(2);
        host.AddString(path);
        host.AddString(ok);
        host.AddString(cancel);
    }
    // The folder in the document's form, with the separator the library uses.
    std::string Folder() const { return dir.string() + "\\"; }
};

TEST_F(OrvexTest, NoArgumentsPrintsThenAlertsMissingParameters) {
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_EQ(host.events,
              (std::vector<std::string>{"print:\nMissing parametrs\n", "alert:\nMissing parametrs\n"}));
    EXPECT_EQ(host.result, "unset"); // the dispatcher's void default stays
    EXPECT_TRUE(platform.steps.empty());
}

TEST_F(OrvexTest, OnlyOneArgumentPrintsMissingButAlertsTheTypeMessage) {
    host.AddShort(1);
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_EQ(host.events, (std::vector<std::string>{"print:\nMissing parametrs\n",
                                                     "alert:\nArgument should be an short"}));
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, FirstArgumentNotShortPrintsThenAlerts) {
    host.AddString(L"a");
    host.AddShort(2);
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_EQ(host.events, (std::vector<std::string>{"print:\nArgument should be an short",
                                                     "alert:\nArgument should be an short"}));
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, LaterWrongTypesAlertThenPrint) {
    const std::vector<std::string> expected{"alert:\nArgument should be an short",
                                            "print:\nArgument should be an short"};
    {
        host.AddShort(1);
        host.AddReal(2.0); // second not a short
        host.AddString(L"");
        host.AddString(L"");
        host.AddString(L"");
        EXPECT_EQ(OrvexWith(platform), 0);
        EXPECT_EQ(host.events, expected);
    }
    for (int wrong = 2; wrong < 5; ++wrong) {
        host.events.clear();
        host.AddShort(1);
        host.AddShort(2);
        for (int i = 2; i < 5; ++i) {
            if (i == wrong)
                host.AddShort(3);
            else
                host.AddString(L"x");
        }
        EXPECT_EQ(OrvexWith(platform), 0) << wrong;
        EXPECT_EQ(host.events, expected) << wrong;
    }
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, MissingStringArgumentsAreTypeErrors) {
    host.AddShort(1);
    host.AddShort(2);
    host.AddString(L"C:\\x");
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_EQ(host.events, (std::vector<std::string>{"alert:\nArgument should be an short",
                                                     "print:\nArgument should be an short"}));
}

TEST_F(OrvexTest, EmptyCaptionsBecomeOkAndCancelAndThereIsNoStartPath) {
    FiveArguments();
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_STREQ(g_szAcceptCaption, "Ok");
    EXPECT_STREQ(g_szCancelCaption, "Cancel");
    EXPECT_STREQ(g_szStartShellPath, "");
    EXPECT_EQ(platform.shellPathAskedFor, "");
}

TEST_F(OrvexTest, CaptionsAndStartPathAreTakenFromTheArguments) {
    FiveArguments(L"C:\\Work\\a.dwg", L"Insert", L"Close");
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_STREQ(g_szAcceptCaption, "Insert");
    EXPECT_STREQ(g_szCancelCaption, "Close");
    EXPECT_EQ(platform.shellPathAskedFor, "C:\\Work\\a.dwg");
    EXPECT_STREQ(g_szStartShellPath, "Desktop\\Computer\\C:\\Work\\a.dwg");
}

TEST_F(OrvexTest, CancelReturnsNilDestroysTheDocumentAndGivesTheFocusBack) {
    FiveArguments();
    platform.dialogResult = 2;
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_EQ(host.result, "nil");
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
    EXPECT_TRUE(fs::exists(platform.settingsFile)) << "the document saves the settings when destroyed";
}

TEST_F(OrvexTest, PickInAFolderWithoutParametersGivesThreeEmptyStrings) {
    FiveArguments();
    platform.dialogResult = 1;
    platform.pickFolder = dir.string();
    platform.pickName = "plan.dwg";
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_EQ(host.result, "(\"" + Folder() + "plan.dwg\" (\"\" \"\" \"\"))");
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, PickReturnsLayerColorAndCommandOfTheFolder) {
    // The library joins folder and file name with a backslash, as on Windows; on other systems that makes
    // one file name, which is where the parameters are put there.
    const fs::path previous = fs::current_path();
    fs::current_path(dir);
#ifdef _WIN32
    fs::create_directories("folder");
#endif
    const char* file = "folder\\datains.ini";
    std::ofstream(file, std::ios::binary)
        << "[Default Parameters]\r\nLayer=Walls\r\nLisp command=(princ)\r\nColor=3\r\n\r\n";
    FiveArguments();
    platform.dialogResult = 1;
    platform.pickFolder = "folder\\"; // already ends in a separator: no second one
    platform.pickName = "a.dwg";
    EXPECT_EQ(OrvexWith(platform), 1);
    fs::current_path(previous);
    EXPECT_EQ(host.result, "(\"folder\\a.dwg\" (\"Walls\" \"3\" \"(princ)\"))");
}

TEST_F(OrvexTest, AcceptWithNoDrawingChosenReturnsNilNotTheFolder) {
    FiveArguments();
    platform.dialogResult = 1;
    platform.pickFolder = dir.string();
    platform.pickName = "";
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_EQ(host.result, "nil");
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
}

TEST_F(OrvexTest, AnExceptionOutOfTheRunStillDestroysTheDocumentAndGivesTheFocusBack) {
    struct ThrowingPlatform : FakePlatform {
        int RunDialog() override {
            FakePlatform::RunDialog();
            throw std::runtime_error("run failed");
        }
    } throwing;
    throwing.settingsFile = platform.settingsFile;
    FiveArguments();
    EXPECT_THROW(OrvexWith(throwing), std::runtime_error);
    EXPECT_EQ(throwing.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, PickedPathAddsTheSeparatorToTheDocumentItself) {
    CTessel3Doc doc((dir / "s.ini").string());
    doc.m_strPath = "C:\\dwg";
    doc.m_strName = "a.dwg";
    EXPECT_EQ(PickedPath(doc), "C:\\dwg\\a.dwg");
    EXPECT_EQ(doc.m_strPath, "C:\\dwg\\");
    EXPECT_EQ(PickedPath(doc), "C:\\dwg\\a.dwg");
}

TEST_F(OrvexTest, OverlongArgumentsAreRefusedWithAMessage) {
    FiveArguments(std::wstring(300, L'x'));
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_NE(host.printed().find("start path is too long (300 characters; at most 259)"), std::string::npos);
    EXPECT_EQ(host.liveNodes, 0);

    host.events.clear();
    FiveArguments(L"", std::wstring(200, L'o'));
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_NE(host.printed().find("accept caption is too long"), std::string::npos);
}

TEST_F(OrvexTest, ARelativeStartPathIsTakenAgainstTheHostsCurrentFolder) {
    FiveArguments(L"Doors\\", L"Insert", L"Close");
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_STREQ(g_szStartPath, "C:\\Host\\Doors\\");
    EXPECT_EQ(platform.shellPathAskedFor, "C:\\Host\\Doors\\");
}

TEST_F(OrvexTest, StartPathsOf259CharactersAreTakenAnd260Or1000Refused) {
    const std::wstring whole259 = L"C:\\" + std::wstring(256, L'x');
    FiveArguments(whole259);
    EXPECT_EQ(OrvexWith(platform), 1);
    EXPECT_EQ(std::string(g_szStartPath).size(), 259u);
    for (std::size_t n : {260u, 1000u}) {
        host.events.clear();
        platform.steps.clear();
        FiveArguments(L"C:\\" + std::wstring(n - 3, L'x'));
        EXPECT_EQ(OrvexWith(platform), 0) << n;
        EXPECT_TRUE(platform.steps.empty()) << n;
        EXPECT_NE(
            host.printed().find("start path is too long (" + std::to_string(n) + " characters; at most 259)"),
            std::string::npos);
        EXPECT_EQ(host.liveNodes, 0);
    }
    // A relative path that fits, but not once made whole, is refused before the explorer opens.
    host.events.clear();
    platform.steps.clear();
    platform.currentFolder = "C:\\" + std::string(100, 'h') + "\\";
    FiveArguments(std::wstring(200, L'r') + L"\\");
    EXPECT_EQ(OrvexWith(platform), 0);
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_NE(host.printed().find("start path is too long (305 characters; at most 259)"), std::string::npos);
}

} // namespace
