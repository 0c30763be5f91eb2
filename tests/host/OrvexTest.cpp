#include "FakeHost.h"
#include "host/EntryPoint.h"
#include "host/Orvex.h"
#include "hostapi/TextConv.h"
#include "settings/Tessel3Doc.h"
#include "tests/support/PickedDrawing.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#ifdef _WIN32
#include <windows.h>
#endif

#if defined(__SANITIZE_ADDRESS__)
#include <sanitizer/lsan_interface.h>
#endif

#include <filesystem>
#include <cstdint>
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
    std::vector<PickerArguments> handed; // what each run was given
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
    int RunDialog(const PickerArguments& arguments) override {
        steps.push_back("dialog");
        handed.push_back(arguments);
        doc = std::make_unique<CTessel3Doc>(settingsFile.string());
        picked.Pick(pickFolder, pickName);
        return dialogResult;
    }
    CTessel3Doc* Document() override { return doc.get(); }
    const DrawingFolder* Folder() override { return &picked.Folder(); }
    testsupport::PickedDrawing picked;
    void DestroyDocument() override {
        steps.push_back("destroy");
        doc.reset();
    }
    void FocusHostView() override { steps.push_back("focus"); }
};

// What a run was handed, field by field: accept, cancel, start path, shell path.
std::vector<std::string> Fields(const PickerArguments& handed) {
    return {handed.acceptCaption, handed.cancelCaption, handed.startPath, handed.startShellPath};
}
using Handed = std::vector<std::string>;

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
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_EQ(host.events,
              (std::vector<std::string>{"print:\nMissing parametrs\n", "alert:\nMissing parametrs\n"}));
    EXPECT_EQ(host.result, "unset"); // the dispatcher's void default stays
    EXPECT_TRUE(platform.steps.empty());
}

TEST_F(OrvexTest, OnlyOneArgumentPrintsMissingButAlertsTheTypeMessage) {
    host.AddShort(1);
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_EQ(host.events, (std::vector<std::string>{"print:\nMissing parametrs\n",
                                                     "alert:\nArgument should be an short"}));
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, FirstArgumentNotShortPrintsThenAlerts) {
    host.AddString(L"a");
    host.AddShort(2);
    EXPECT_EQ(Orvex(platform), 0);
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
        EXPECT_EQ(Orvex(platform), 0);
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
        EXPECT_EQ(Orvex(platform), 0) << wrong;
        EXPECT_EQ(host.events, expected) << wrong;
    }
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, MissingStringArgumentsAreTypeErrors) {
    host.AddShort(1);
    host.AddShort(2);
    host.AddString(L"C:\\x");
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_EQ(host.events, (std::vector<std::string>{"alert:\nArgument should be an short",
                                                     "print:\nArgument should be an short"}));
}

TEST_F(OrvexTest, EmptyCaptionsBecomeOkAndCancelAndThereIsNoStartPath) {
    FiveArguments();
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(Fields(platform.handed[0]), (Handed{"Ok", "Cancel", "", ""}));
    EXPECT_EQ(platform.shellPathAskedFor, "");
}

TEST_F(OrvexTest, CaptionsAndStartPathAreTakenFromTheArguments) {
    FiveArguments(L"C:\\Work\\a.dwg", L"Insert", L"Close");
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(Fields(platform.handed[0]),
              (Handed{"Insert", "Close", "C:\\Work\\a.dwg", "Desktop\\Computer\\C:\\Work\\a.dwg"}));
    EXPECT_EQ(platform.shellPathAskedFor, "C:\\Work\\a.dwg");
}

TEST_F(OrvexTest, EachCallIsHandedItsOwnArgumentsAndNothingOfTheCallBefore) {
    FiveArguments(L"C:\\Work\\", L"Insert", L"Close");
    EXPECT_EQ(Orvex(platform), 1);
    FiveArguments();
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 2u);
    EXPECT_EQ(Fields(platform.handed[0]),
              (Handed{"Insert", "Close", "C:\\Work\\", "Desktop\\Computer\\C:\\Work\\"}));
    EXPECT_EQ(Fields(platform.handed[1]), (Handed{"Ok", "Cancel", "", ""}))
        << "no start path: the tree opens where it was left";
}

TEST_F(OrvexTest, ARefusedCallHandsNothingOnAndTheNextOneIsItsOwn) {
    FiveArguments(L"C:\\Work\\", L"Insert", std::wstring(128, L'c'));
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_TRUE(platform.handed.empty());
    EXPECT_EQ(platform.shellPathAskedFor, "") << "the shell is not asked for a refused call";
    EXPECT_NE(host.printed().find("cancel caption is too long (128 characters; at most 127)"),
              std::string::npos);

    FiveArguments(L"", L"", std::wstring(127, L'c'));
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(Fields(platform.handed[0]), (Handed{"Ok", std::string(127, 'c'), "", ""}));
}

TEST_F(OrvexTest, CancelReturnsNilDestroysTheDocumentAndGivesTheFocusBack) {
    FiveArguments();
    platform.dialogResult = 2;
    EXPECT_EQ(Orvex(platform), 1);
    EXPECT_EQ(host.result, "nil");
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
    EXPECT_TRUE(fs::exists(platform.settingsFile)) << "the document saves the settings when destroyed";
}

TEST_F(OrvexTest, PickInAFolderWithoutParametersGivesThreeEmptyStrings) {
    FiveArguments();
    platform.dialogResult = 1;
    platform.pickFolder = dir.string();
    platform.pickName = "plan.dwg";
    EXPECT_EQ(Orvex(platform), 1);
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
    EXPECT_EQ(Orvex(platform), 1);
    fs::current_path(previous);
    EXPECT_EQ(host.result, "(\"folder\\a.dwg\" (\"Walls\" \"3\" \"(princ)\"))");
}

TEST_F(OrvexTest, AcceptWithNoDrawingChosenReturnsNilNotTheFolder) {
    FiveArguments();
    platform.dialogResult = 1;
    platform.pickFolder = dir.string();
    platform.pickName = "";
    EXPECT_EQ(Orvex(platform), 1);
    EXPECT_EQ(host.result, "nil");
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
}

TEST_F(OrvexTest, ASecondCallWhileTheExplorerIsOpenIsRefusedAndTheOpenOneGoesOn) {
    // The host makes a second call from inside the first one's loop, with arguments of its own.
    struct ReenteringPlatform : FakePlatform {
        FakeHost* host = nullptr;
        int innerReturn = -1;
        std::vector<std::string> innerEvents;
        std::string innerResult, captionDuringRun;
        std::size_t runsHandedDuringRun = 0;
        int RunDialog(const PickerArguments& arguments) override {
            FakePlatform::RunDialog(arguments);
            host->events.clear();
            host->AddShort(1);
            host->AddShort(2);
            host->AddString(L"C:\\other\\");
            host->AddString(L"Take");
            host->AddString(L"Leave");
            innerReturn = Orvex(*this);
            innerEvents = host->events;
            innerResult = host->result;
            captionDuringRun = arguments.acceptCaption;
            runsHandedDuringRun = handed.size();
            return dialogResult;
        }
    } reentering;
    reentering.host = &host;
    reentering.settingsFile = platform.settingsFile;
    reentering.dialogResult = 1;
    reentering.pickFolder = dir.string();
    reentering.pickName = "door.dwg";
    FiveArguments(L"", L"Insert", L"Close");

    EXPECT_EQ(Orvex(reentering), 1);
    EXPECT_EQ(reentering.innerReturn, 1);
    EXPECT_EQ(
        reentering.innerEvents,
        (std::vector<std::string>{"print:\nOrvex: the explorer is already open; this call returns nil\n",
                                  "alert:\nOrvex: the explorer is already open; this call returns nil\n"}));
    EXPECT_EQ(reentering.innerResult, "nil");
    EXPECT_EQ(reentering.captionDuringRun, "Insert") << "the open explorer keeps its captions";
    EXPECT_EQ(reentering.runsHandedDuringRun, 1u) << "the refused call hands the platform nothing";
    EXPECT_EQ(reentering.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}))
        << "the refused call neither runs a dialog nor destroys the open one's document";
    EXPECT_EQ(host.result, "(\"" + Folder() + "door.dwg\" (\"\" \"\" \"\"))");
    EXPECT_EQ(host.liveNodes, 0) << "the refused call's arguments are released";

    // Once the first call has returned, the next one runs as usual.
    FiveArguments();
    EXPECT_EQ(Orvex(platform), 1);
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
}

TEST_F(OrvexTest, AnExceptionOutOfTheRunStillDestroysTheDocumentAndGivesTheFocusBack) {
    struct ThrowingPlatform : FakePlatform {
        int RunDialog(const PickerArguments& arguments) override {
            FakePlatform::RunDialog(arguments);
            throw std::runtime_error("run failed");
        }
    } throwing;
    throwing.settingsFile = platform.settingsFile;
    FiveArguments();
    EXPECT_THROW(Orvex(throwing), std::runtime_error);
    EXPECT_EQ(throwing.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
    EXPECT_EQ(host.liveNodes, 0);
}

TEST_F(OrvexTest, OverlongArgumentsAreRefusedWithAMessage) {
    FiveArguments(std::wstring(300, L'x'));
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_NE(host.printed().find("start path is too long (300 characters; at most 259)"), std::string::npos);
    EXPECT_EQ(host.liveNodes, 0);

    host.events.clear();
    FiveArguments(L"", std::wstring(200, L'o'));
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_NE(host.printed().find("accept caption is too long"), std::string::npos);
}

TEST_F(OrvexTest, AStartPathWithALineBreakOrAnotherControlCharacterIsRefusedWithAMessage) {
    // Before, "C:\a\r\n[View]\r\nb\" opened the explorer and was written into the settings as it was.
    const std::wstring withLineBreak = L"C:\\a\r\n[View]\r\nb\\";
    FiveArguments(withLineBreak, L"Insert", L"Close");
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_TRUE(platform.steps.empty()) << "no explorer, no document, nothing saved";
    EXPECT_FALSE(std::filesystem::exists(platform.settingsFile));
    EXPECT_EQ(host.events,
              (std::vector<std::string>{"print:\nOrvex: the start path holds a control character (code 13 at "
                                        "character 5); it is refused\n",
                                        "alert:\nOrvex: the start path holds a control character"}));
    EXPECT_EQ(host.result, "unset") << "returns as the other refusals do";
    EXPECT_EQ(host.liveNodes, 0);
    for (const wchar_t c : {L'\n', L'\t', L'\x01', L'\x1F', L'\x7F'}) {
        host.events.clear();
        FiveArguments(std::wstring(L"C:\\dwg") + c + L"\\");
        EXPECT_EQ(Orvex(platform), 0) << static_cast<int>(c);
        EXPECT_TRUE(platform.steps.empty()) << static_cast<int>(c);
    }
    // Everything else a folder name can hold is taken.
    host.events.clear();
    FiveArguments(L"C:\\Plans 2024 (old) ~#;=\\", L"Insert", L"Close");
    EXPECT_EQ(Orvex(platform), 1);
    EXPECT_EQ(platform.steps, (std::vector<std::string>{"dialog", "destroy", "focus"}));
}

TEST_F(OrvexTest, ARelativeStartPathIsTakenAgainstTheHostsCurrentFolder) {
    FiveArguments(L"Doors\\", L"Insert", L"Close");
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(platform.handed[0].startPath, "C:\\Host\\Doors\\");
    EXPECT_EQ(platform.shellPathAskedFor, "C:\\Host\\Doors\\");
}

TEST_F(OrvexTest, StartPathsOf259CharactersAreTakenAnd260Or1000Refused) {
    const std::wstring whole259 = L"C:\\" + std::wstring(256, L'x');
    FiveArguments(whole259);
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(platform.handed[0].startPath, NarrowAnsi(whole259));
    for (std::size_t n : {260u, 1000u}) {
        host.events.clear();
        platform.steps.clear();
        FiveArguments(L"C:\\" + std::wstring(n - 3, L'x'));
        EXPECT_EQ(Orvex(platform), 0) << n;
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
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_NE(host.printed().find("start path is too long (305 characters; at most 259)"), std::string::npos);
}

#ifdef _WIN32
// Run again with Wine in the Japanese locale: a character of the code page is two bytes there, and the
// bound and the message count characters, not bytes.
TEST_F(OrvexTest, AJapaneseStartPathIsMeasuredInCharacters) {
    if (::GetACP() != 932)
        GTEST_SKIP() << "runs in code page 932, this is " << ::GetACP();
    const std::wstring so = L"\x30BD"; // katakana so: two bytes, the second one "\"
    std::wstring path = L"C:\\";
    for (int i = 0; i < 157; ++i)
        path += so;
    path += L"\\"; // 161 characters, 318 bytes
    ASSERT_EQ(NarrowAnsi(path).size(), 318u);
    FiveArguments(path);
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 1u);
    EXPECT_EQ(platform.handed[0].startPath, NarrowAnsi(path));
    EXPECT_EQ(host.printed().find("too long"), std::string::npos) << host.printed();

    // Made whole it grows past the bound: 305 characters (405 bytes) are said.
    host.events.clear();
    platform.steps.clear();
    std::wstring current = L"C:\\";
    for (int i = 0; i < 100; ++i)
        current += so;
    platform.currentFolder = NarrowAnsi(current + L"\\");
    FiveArguments(std::wstring(200, L'r') + L"\\");
    EXPECT_EQ(Orvex(platform), 0);
    EXPECT_TRUE(platform.steps.empty());
    EXPECT_NE(host.printed().find("start path is too long (305 characters; at most 259)"), std::string::npos)
        << host.printed();

    // A caption of 100 Japanese characters (200 bytes) is within its 127.
    host.events.clear();
    platform.steps.clear();
    std::wstring caption;
    for (int i = 0; i < 100; ++i)
        caption += so;
    FiveArguments(L"C:\\dwg\\", caption, L"Close");
    EXPECT_EQ(Orvex(platform), 1);
    EXPECT_EQ(platform.handed.back().acceptCaption, NarrowAnsi(caption));
}
#endif

TEST_F(OrvexTest, AShellPathTooLongIsSaidAndTheRunStartsWithoutOne) {
    // This platform's shell path is the path behind "Desktop\Computer\" (17 characters): a start path of
    // 242 characters gives 259, which is taken, and one of 243 gives 260, which is not.
    FiveArguments(L"C:\\" + std::wstring(239, L'x'));
    EXPECT_EQ(Orvex(platform), 1);
    FiveArguments(L"C:\\" + std::wstring(240, L'x'));
    EXPECT_EQ(Orvex(platform), 1);
    ASSERT_EQ(platform.handed.size(), 2u);
    EXPECT_EQ(platform.handed[0].startShellPath.size(), 259u);
    EXPECT_EQ(platform.handed[1].startPath.size(), 243u) << "the start path itself is still handed on";
    EXPECT_EQ(platform.handed[1].startShellPath, "");
    EXPECT_EQ(host.printed(),
              "\nOrvex: the start folder's shell path is too long; starting at the last folder\n");
}

} // namespace

// ---- a host that lacks one operation, each in turn ------------------------------------------------------

namespace {

struct HostOperation {
    const char* name;
    void (*remove)(HostApi& api);
};

#define ORVEX_HOST_REMOVER(ret, name, params) {#name, [](HostApi& api) { api.name = nullptr; }},
const HostOperation kHostOperations[] = {ORVEX_HOST_OPERATIONS(ORVEX_HOST_REMOVER)};
#undef ORVEX_HOST_REMOVER

void PrintTo(const HostOperation& operation, std::ostream* out) {
    *out << operation.name;
}

class HostLackingOneOperation : public ::testing::TestWithParam<HostOperation> {};

int CountContaining(const std::vector<std::string>& events, const std::string& part) {
    int n = 0;
    for (const std::string& event : events)
        n += event.find(part) != std::string::npos;
    return n;
}

} // namespace

// The whole life of the library in one drawing, with a pick in a folder that has parameters: loading,
// the drawing, the call, unloading. Whatever the host lacks, every message is answered, nothing throws
// or crashes (the sanitizers watch the native build), the missing operation is said at most once and no
// other one is blamed; what does not need the operation still works.
TEST_P(HostLackingOneOperation, TheLibraryDegradesAndSaysItOnce) {
    const HostOperation operation = GetParam();
    FakeHost host;
    HostApi api = Host();
    operation.remove(api);
    SetHostApi(api);

    // The folder and the file name are joined with a backslash, as on Windows: natively that makes one
    // file name, which is where the parameters are put (see PickReturnsLayerColorAndCommandOfTheFolder).
    testsupport::TempFolder folder;
    const std::string pickFolder = (folder.Path() / "doors").string();
#ifdef _WIN32
    fs::create_directories(pickFolder);
#endif
    std::ofstream(pickFolder + "\\datains.ini", std::ios::binary)
        << "[Default Parameters]\r\nLayer=Walls\r\nLisp command=(c:go)\r\nColor=3\r\n";
    FakePlatform platform;
    platform.settingsFile = folder.Path() / "Orvex1.ini";
    platform.dialogResult = 1;
    platform.pickFolder = pickFolder;
    platform.pickName = "door.dwg";
    void* appId = reinterpret_cast<void*>(std::uintptr_t{42});

#if defined(__SANITIZE_ADDRESS__)
    // Without the host's release operation the library cannot give the host's nodes back: they stay the
    // host's (this fake host does not collect them), which is not the library's leak.
    std::unique_ptr<__lsan::ScopedDisabler> hostKeepsItsNodes;
    if (std::string(operation.name) == "acutRelRb")
        hostKeepsItsNodes = std::make_unique<__lsan::ScopedDisabler>();
#endif
    EXPECT_NO_THROW({
        EXPECT_EQ(DispatchEntryMessage(AcRx::kInitAppMsg, appId, platform), AcRx::kRetOK);
        EXPECT_EQ(DispatchEntryMessage(AcRx::kLoadDwgMsg, appId, platform), AcRx::kRetOK);
        host.funCode = 0;
        host.AddShort(1);
        host.AddShort(2);
        host.AddString(L"");
        host.AddString(L"Insert");
        host.AddString(L"Close");
        EXPECT_EQ(DispatchEntryMessage(AcRx::kInvkSubrMsg, appId, platform), AcRx::kRetOK);
        EXPECT_EQ(DispatchEntryMessage(AcRx::kUnloadDwgMsg, appId, platform), AcRx::kRetOK);
        EXPECT_EQ(DispatchEntryMessage(AcRx::kUnloadAppMsg, appId, platform), AcRx::kRetOK);
    });

    const std::string said = std::string("the host does not provide ") + operation.name + ";";
    EXPECT_LE(CountContaining(host.events, said), 1) << "said once at most";
    EXPECT_EQ(CountContaining(host.events, "the host does not provide "), CountContaining(host.events, said))
        << "no other operation is blamed";
    const std::string name = operation.name;
    if (name != "acutPrintf" && CountContaining(host.events, said) == 0) {
        // Not said: then it was not needed, and the pick came back whole.
        EXPECT_EQ(host.result, "(\"" + platform.pickFolder + "\\door.dwg\" (\"Walls\" \"3\" \"(c:go)\"))")
            << "events: " << ::testing::PrintToString(host.events);
    }
    if (name == "acedGetArgs") {
        EXPECT_EQ(host.events.back(), "alert:\nMissing parametrs\n") << "no arguments: the fixed message";
    }
    if (name == "acedRetList") {
        EXPECT_EQ(host.result, "void") << "no list can be handed back: the call leaves no value";
    }
}

INSTANTIATE_TEST_SUITE_P(EachInTurn, HostLackingOneOperation, ::testing::ValuesIn(kHostOperations),
                         [](const ::testing::TestParamInfo<HostOperation>& param) {
                             return std::string(param.param.name);
                         });
