// Runs devhost.exe with the test extension (fakearx.arx) and checks, line by line, what it writes on its
// command line (standard output) and its exit code.
#include "devhost/Bitmap.h"
#include "devhost/Text.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>
#include <windows.h>

#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

namespace {

std::wstring BinDirectory() {
    wchar_t path[MAX_PATH] = {};
    GetModuleFileNameW(nullptr, path, MAX_PATH);
    std::wstring text = path;
    return text.substr(0, text.find_last_of(L"\\/") + 1);
}

// One argument quoted the way CommandLineToArgvW reads it back.
std::wstring Quote(const std::wstring& arg) {
    if (!arg.empty() && arg.find_first_of(L" \t\"") == std::wstring::npos)
        return arg;
    std::wstring out = L"\"";
    std::size_t backslashes = 0;
    for (wchar_t c : arg) {
        if (c == L'\\') {
            ++backslashes;
            continue;
        }
        if (c == L'"')
            out.append(backslashes * 2 + 1, L'\\');
        else
            out.append(backslashes, L'\\');
        backslashes = 0;
        out += c;
    }
    out.append(backslashes * 2, L'\\');
    return out + L"\"";
}

struct RunResult {
    DWORD exitCode = 0;
    std::vector<std::string> lines; // standard output
    std::string errors;             // standard error
    std::string output;
};

std::string ReadAll(HANDLE pipe) {
    std::string text;
    char buffer[4096];
    DWORD read = 0;
    while (ReadFile(pipe, buffer, sizeof buffer, &read, nullptr) && read > 0)
        text.append(buffer, read);
    return text;
}

std::vector<std::string> SplitLines(const std::string& text) {
    std::vector<std::string> lines;
    std::size_t start = 0;
    while (start < text.size()) {
        const std::size_t end = text.find('\n', start);
        lines.push_back(text.substr(start, end == std::string::npos ? std::string::npos : end - start));
        if (end == std::string::npos)
            break;
        start = end + 1;
    }
    return lines;
}

// devhost.exe [--arx fakearx.arx] ARGS, with a time limit.
RunResult RunDevhost(const std::vector<std::wstring>& args, bool withFake = true) {
    std::wstring commandLine = Quote(BinDirectory() + L"devhost.exe");
    if (withFake)
        commandLine += L" --arx " + Quote(BinDirectory() + L"fakearx.arx");
    for (const std::wstring& arg : args)
        commandLine += L" " + Quote(arg);

    SECURITY_ATTRIBUTES inherit{sizeof inherit, nullptr, TRUE};
    HANDLE outRead = nullptr, outWrite = nullptr, errRead = nullptr, errWrite = nullptr;
    CreatePipe(&outRead, &outWrite, &inherit, 0);
    CreatePipe(&errRead, &errWrite, &inherit, 0);
    SetHandleInformation(outRead, HANDLE_FLAG_INHERIT, 0);
    SetHandleInformation(errRead, HANDLE_FLAG_INHERIT, 0);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdInput = GetStdHandle(STD_INPUT_HANDLE);
    startup.hStdOutput = outWrite;
    startup.hStdError = errWrite;
    PROCESS_INFORMATION process{};
    RunResult result;
    std::vector<wchar_t> mutableLine(commandLine.begin(), commandLine.end());
    mutableLine.push_back(0);
    const BOOL started = CreateProcessW(nullptr, mutableLine.data(), nullptr, nullptr, TRUE, 0, nullptr,
                                        nullptr, &startup, &process);
    CloseHandle(outWrite);
    CloseHandle(errWrite);
    if (!started) {
        ADD_FAILURE() << "cannot start devhost.exe, error " << GetLastError();
        CloseHandle(outRead);
        CloseHandle(errRead);
        return result;
    }
    std::string errors;
    std::thread errorReader([&] { errors = ReadAll(errRead); });
    std::thread outputReader([&] { result.output = ReadAll(outRead); });
    if (WaitForSingleObject(process.hProcess, 60000) != WAIT_OBJECT_0) {
        ADD_FAILURE() << "devhost.exe did not end within 60 s";
        TerminateProcess(process.hProcess, 99);
        WaitForSingleObject(process.hProcess, 5000);
    }
    outputReader.join();
    errorReader.join();
    GetExitCodeProcess(process.hProcess, &result.exitCode);
    CloseHandle(process.hProcess);
    CloseHandle(process.hThread);
    CloseHandle(outRead);
    CloseHandle(errRead);
    result.errors = errors;
    result.lines = SplitLines(result.output);
    return result;
}

using Lines = std::vector<std::string>;

// What the fake prints around the calls when it is loaded with one drawing.
Lines Opening() {
    return {"fake: initApp", "fake: message 1 linker 1 unlock 1 mdi 1 other id 0", "fake: created #1",
            "fake: activated #1", "fake: message 3 in #1 defined 11"};
}

Lines Closing() {
    return {"fake: message 4 in #1 undefined 11", "fake: to be destroyed #1", "fake: message 2",
            "fake: uninitApp"};
}

Lines WithCalls(const Lines& calls) {
    Lines all = Opening();
    all.insert(all.end(), calls.begin(), calls.end());
    const Lines closing = Closing();
    all.insert(all.end(), closing.begin(), closing.end());
    return all;
}

std::wstring TempFile(const std::wstring& name) {
    static const testsupport::TempFolder scratch("devhost-test"); // one for the program, removed at its end
    return (scratch.Path() / name).wstring();
}

void WriteFileText(const std::wstring& path, const std::string& text) {
    std::ofstream file(path.c_str(), std::ios::binary);
    file << text;
}

TEST(Devhost, LifecycleModuleFirstWithTwoDrawings) {
    const RunResult run = RunDevhost({L"--drawings", L"2", L"--eval", L"(echo 1 2)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines,
              (Lines{"fake: initApp", "fake: message 1 linker 1 unlock 1 mdi 1 other id 0",
                     "fake: created #1", "fake: activated #1", "fake: message 3 in #1 defined 11",
                     "fake: created #2", "fake: activated #2", "fake: message 3 in #2 defined 11",
                     "fake: activated #1", "=> (1 2)", "fake: message 4 in #1 undefined 11",
                     "fake: to be destroyed #1", "fake: activated #2", "fake: message 4 in #2 undefined 11",
                     "fake: to be destroyed #2", "fake: message 2", "fake: uninitApp"}));
}

TEST(Devhost, LifecycleEntryFirst) {
    const RunResult run = RunDevhost({L"--order", L"entry-first"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines, (Lines{"fake: message 1 linker 1 unlock 1 mdi 1 other id 0", "fake: initApp",
                                "fake: created #1", "fake: activated #1", "fake: message 3 in #1 defined 11",
                                "fake: message 4 in #1 undefined 11", "fake: to be destroyed #1",
                                "fake: message 2", "fake: uninitApp"}));
}

TEST(Devhost, ResultsInLispForm) {
    const RunResult run =
        RunDevhost({L"--eval", LR"((echo 1 2 "C:\\dwg\\" "Insert" "Close"))", L"--eval", L"(nothing)",
                    L"--eval", L"(void 1)", L"--eval", L"(ECHO \"one\")", L"--eval",
                    L"(keep -40000 2.5 nil '(1 \"a\" (T)))", L"--eval", L"(build)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines,
              WithCalls({R"(=> (1 2 "C:\\dwg\\" "Insert" "Close"))", "=> nil", "=> (no value)", "=> \"one\"",
                         R"(=> (-40000 2.5 (1 "a" (T))))", "=> (\"a\" (1 100000 2.5 (1.0 2.0 3.0)) nil)"}));
}

TEST(Devhost, PrintAlertAndFailure) {
    const RunResult run = RunDevhost({L"--eval", L"(talk)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines, WithCalls({"", "hello wide 42 1.50 narrow", R"([alert] \nline1\nline2\t\\end)",
                                    R"([fail] oops\n)", "=> (no value)"}));
}

TEST(Devhost, UnknownFunctionAndBadText) {
    const RunResult run =
        RunDevhost({L"--eval", L"(nope 1)", L"--eval", L"(echo \"abc", L"--eval", L"(echo 1))", L"--eval",
                    L"(echo 99999999999)", L"--eval", L"(echo 3)"});
    EXPECT_EQ(run.exitCode, 1u) << run.errors;
    EXPECT_EQ(run.lines,
              WithCalls({"; error: no function definition: nope", "; error: unterminated string: \"abc",
                         "; error: extra text after the call: )",
                         "; error: integer out of range: 99999999999", "=> 3"}));
}

TEST(Devhost, LayersPaletteAndWindows) {
    const RunResult run =
        RunDevhost({L"--layer", L"WALLS=1", L"--layer", L"Doors=20", L"--eval", L"(layer \"walls\")",
                    L"--eval", L"(layer \"DOORS\")", L"--eval", L"(layer \"0\")", L"--eval",
                    L"(layer \"none\")", L"--eval", L"(windows)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(
        run.lines,
        WithCalls({"=> (\"walls\" 1 255)", "=> (\"DOORS\" 20 16383)", "=> (\"0\" 7 16777215)", "=> nil",
                   "=> (\"DevhostFrame\" \"DevhostFrame\" \"DevhostDrawingView\" 1 1)"}));
}

// (misc) opens the colour dialog on index 3 without logical colours and returns (chosen index drawn code).
TEST(Devhost, ColourDialogChosenWithClicks) {
    const std::wstring script = TempFile(L"colour.txt");
    WriteFileText(script, "wait class=DevhostColorDialog timeout=10000\n"
                          "text class=DevhostColorDialog > id=1302\n"
                          "enabled class=DevhostColorDialog > text=ByLayer\n"
                          "enabled class=DevhostColorDialog > text=ByBlock\n"
                          "count class=DevhostColorDialog > class=DevhostSwatch\n"
                          "enabled class=DevhostFrame\n"
                          "click class=DevhostColorDialog > id=1005\n"
                          "text class=DevhostColorDialog > id=1302\n"
                          "click class=DevhostColorDialog > id=1\n"
                          "gone class=DevhostColorDialog visible=any\n");
    const RunResult run = RunDevhost({L"--script", script, L"--eval", L"(misc)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors << run.output;
    // 255 palette swatches and the sample of the chosen colour; the host's frame is disabled meanwhile.
    EXPECT_EQ(run.lines, WithCalls({"[script] text Color 3", "[script] enabled no", "[script] enabled no",
                                    "[script] count 256", "[script] enabled no", "[script] text Color 5",
                                    "=> (1 5 0 8)"}));
}

TEST(Devhost, ColourDialogCancelled) {
    const std::wstring script = TempFile(L"colour-cancel.txt");
    WriteFileText(script, "wait class=DevhostColorDialog timeout=10000\n"
                          "click class=DevhostColorDialog > id=1200\n"
                          "click class=DevhostColorDialog > text=Cancel\n"
                          "returned\n"
                          "exists class=DevhostColorDialog visible=any\n"
                          "enabled class=DevhostFrame\n");
    const RunResult run = RunDevhost({L"--script", script, L"--eval", L"(misc)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors << run.output;
    EXPECT_EQ(run.lines, WithCalls({"=> (0 3 0 8)", "[script] returned", "[script] exists no",
                                    "[script] enabled yes"}));
}

TEST(Devhost, AfterMsEndsACallWaitingInTheColourDialog) {
    const RunResult run = RunDevhost({L"--after-ms", L"300", L"--post", L"cancel", L"--eval", L"(misc)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines, WithCalls({"=> (0 3 0 8)"}));
}

TEST(Devhost, PostsAcceptAndCancelToTheRunDialog) {
    const RunResult run = RunDevhost(
        {L"--after-ms", L"300", L"--post", L"accept", L"--eval", L"(picker)", L"--eval", L"(picker)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines, WithCalls({"=> (\"picker\" 1 \"\")", "=> (\"picker\" 1 \"\")"}));
    const RunResult cancelled =
        RunDevhost({L"--after-ms", L"100", L"--post", L"cancel", L"--eval", L"(picker)"});
    EXPECT_EQ(cancelled.lines, WithCalls({"=> (\"picker\" 2 \"\")"}));
}

TEST(Devhost, ScriptDrivesADialogWithRealInput) {
    const std::wstring script = TempFile(L"click.txt");
    const std::wstring shot = TempFile(L"shot.bmp");
    DeleteFileW(shot.c_str());
    WriteFileText(script, "# pick in the fake dialog\n"
                          "wait class=#32770 text=\"Fake picker\" timeout=10000\n"
                          "count class=DevhostDrawingView\n"
                          "count class=DevhostFrame > class=DevhostDrawingView visible=any\n"
                          "text class=#32770 > id=1001\n"
                          "enabled id=1001\n"
                          "screenshot class=#32770 \"" +
                              devhost::ToUtf8(shot) +
                              "\"\n"
                              "click class=#32770 > id=1002\n"
                              "type \"hi there\"\n"
                              "key backspace shift+home\n"
                              "key end\n"
                              "click class=#32770 > id=1001\n"
                              "gone class=#32770 text=\"Fake picker\" visible=any\n"
                              "sleep 200\n"
                              "focus\n"
                              "echo done\n");
    const RunResult run = RunDevhost({L"--drawings", L"2", L"--script", script, L"--eval", L"(picker)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors << run.output;
    ASSERT_GE(run.lines.size(), 14u) << run.output;
    Lines lines = run.lines;
    // The screenshot line carries the window's size, which depends on the font.
    bool sawShot = false;
    for (std::string& line : lines) {
        const std::string prefix = "[script] screenshot " + devhost::ToUtf8(shot) + " ";
        if (line.rfind(prefix, 0) == 0) {
            sawShot = line.find('x', prefix.size()) != std::string::npos;
            line = "[script] screenshot";
        }
    }
    EXPECT_TRUE(sawShot) << run.output;
    EXPECT_EQ(lines, (Lines{"fake: initApp",
                            "fake: message 1 linker 1 unlock 1 mdi 1 other id 0",
                            "fake: created #1",
                            "fake: activated #1",
                            "fake: message 3 in #1 defined 11",
                            "fake: created #2",
                            "fake: activated #2",
                            "fake: message 3 in #2 defined 11",
                            "fake: activated #1",
                            "[script] count 1",
                            "[script] count 2",
                            "[script] text Pick",
                            "[script] enabled yes",
                            "[script] screenshot",
                            "=> (\"picker\" 7 \"hi ther\")",
                            "[script] focus DevhostDrawingView id=59648",
                            "[script] done",
                            "fake: message 4 in #1 undefined 11",
                            "fake: to be destroyed #1",
                            "fake: activated #2",
                            "fake: message 4 in #2 undefined 11",
                            "fake: to be destroyed #2",
                            "fake: message 2",
                            "fake: uninitApp"}));
    std::ifstream file(shot.c_str(), std::ios::binary);
    const std::vector<std::uint8_t> bytes((std::istreambuf_iterator<char>(file)),
                                          std::istreambuf_iterator<char>());
    devhost::Image image;
    ASSERT_TRUE(devhost::DecodeBmp24(bytes, image)) << "no BMP written";
    EXPECT_GT(image.width, 100);
    EXPECT_GT(devhost::CountColours(image), 2u) << "the screenshot is blank";
    DeleteFileW(script.c_str());
    DeleteFileW(shot.c_str());
}

TEST(Devhost, ScriptDrivesATreeByItsLabels) {
    const std::wstring script = TempFile(L"tree.txt");
    WriteFileText(script, "wait class=#32770 text=\"Fake tree picker\" timeout=10000\n"
                          "tree-items class=#32770 > id=1003\n"
                          "tree-expand class=#32770 > id=1003 path=Desktop\n"
                          "tree-expand class=#32770 > id=1003 path=\"desktop\\my computer\"\n"
                          "tree-expand class=#32770 > id=1003 path=\"Desktop\\My Computer\\Drive Z\"\n"
                          "tree-select class=#32770 > id=1003 path=\"Desktop\\My Computer\\Drive Z\\work\"\n"
                          "tree-items class=#32770 > id=1003\n"
                          "tree-collapse class=#32770 > id=1003 path=\"Desktop\\My Computer\\Drive Z\"\n"
                          "tree-right-click class=#32770 > id=1003 path=\"Desktop\\My Computer\\Drive C\"\n"
                          "sleep 300\n"
                          "tree-items class=#32770 > id=1003\n"
                          "click class=#32770 > id=1001\n"
                          "gone class=#32770 text=\"Fake tree picker\" visible=any\n");
    const RunResult run = RunDevhost({L"--script", script, L"--eval", L"(picker \"tree\")"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors << run.output;
    // The dialog gives the tree the focus, which selects its first item.
    EXPECT_EQ(run.lines, WithCalls({"[script] tree-item 0 Desktop selected",
                                    "[script] tree-item 0 Recycle",
                                    "[script] tree-item 0 Desktop expanded",
                                    "[script] tree-item 1 My Computer expanded",
                                    "[script] tree-item 2 Drive C",
                                    "[script] tree-item 2 Drive Z expanded",
                                    "[script] tree-item 3 work selected",
                                    "[script] tree-item 3 old",
                                    "[script] tree-item 1 Network",
                                    "[script] tree-item 0 Recycle",
                                    "fake: tree right-click Drive C",
                                    "[script] tree-item 0 Desktop expanded",
                                    "[script] tree-item 1 My Computer expanded",
                                    "[script] tree-item 2 Drive C",
                                    "[script] tree-item 2 Drive Z selected",
                                    "[script] tree-item 1 Network",
                                    "[script] tree-item 0 Recycle",
                                    "=> (\"picker\" 7 \"Drive Z\")"}))
        << run.output;
    DeleteFileW(script.c_str());
}

TEST(Devhost, ScriptTreeItemThatIsNotThereFailsTheRun) {
    const std::wstring script = TempFile(L"tree-missing.txt");
    WriteFileText(script, "wait class=#32770 text=\"Fake tree picker\" timeout=10000\n"
                          "tree-select class=#32770 > id=1003 path=\"Desktop\\Nowhere\\x\"\n"
                          "echo never\n");
    const RunResult closed = RunDevhost({L"--script", script, L"--eval", L"(picker \"tree\")"});
    EXPECT_EQ(closed.exitCode, 4u) << closed.errors;
    EXPECT_EQ(closed.lines, WithCalls({"[script] error: line 2: no tree item Desktop\\\\Nowhere",
                                       "=> (\"picker\" 2 \"\")"}));
    WriteFileText(script, "wait class=#32770 text=\"Fake tree picker\" timeout=10000\n"
                          "tree-select class=#32770 > id=1003 path=\"Desktop\\My Computer\"\n");
    const RunResult hidden = RunDevhost({L"--script", script, L"--eval", L"(picker \"tree\")"});
    EXPECT_EQ(hidden.exitCode, 4u) << hidden.errors;
    EXPECT_EQ(hidden.lines,
              WithCalls({"[script] error: line 2: tree item Desktop\\\\My Computer is inside a closed item",
                         "=> (\"picker\" 2 \"\")"}));
    DeleteFileW(script.c_str());
}

TEST(Devhost, AlertBoxWaitsForThePerson) {
    const std::wstring script = TempFile(L"alert.txt");
    WriteFileText(script, "wait class=#32770 text=devhost timeout=10000\n"
                          "text class=#32770 text=devhost > class=Static contains=line2\n"
                          "click class=#32770 text=devhost > class=Button text=OK\n"
                          "gone class=#32770 text=devhost visible=any\n");
    const RunResult run = RunDevhost({L"--alert-box", L"--script", script, L"--eval", L"(talk)"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    EXPECT_EQ(run.lines,
              WithCalls({"", "hello wide 42 1.50 narrow", R"([alert] \nline1\nline2\t\\end)",
                         R"([script] text \nline1\nline2\t\\end)", R"([fail] oops\n)", "=> (no value)"}));
    DeleteFileW(script.c_str());
}

TEST(Devhost, ScriptTimeoutFailsTheRunAndCancelsTheCall) {
    const std::wstring script = TempFile(L"timeout.txt");
    WriteFileText(script, "wait class=#32770 text=\"Fake picker\"\n"
                          "wait class=NoSuchClass timeout=300\n"
                          "echo never\n");
    const RunResult run = RunDevhost({L"--script", script, L"--eval", L"(picker)"});
    EXPECT_EQ(run.exitCode, 4u) << run.errors;
    EXPECT_EQ(run.lines, WithCalls({"[script] error: line 2: no window class=NoSuchClass within 300 ms",
                                    "=> (\"picker\" 2 \"\")"}));
    DeleteFileW(script.c_str());
}

TEST(Devhost, ScriptOnTheHostsOwnWindows) {
    const std::wstring script = TempFile(L"own.txt");
    WriteFileText(script, "text class=DevhostFrame\n"
                          "exists class=DevhostFrame > id=59649 visible=any\n"
                          "exists class=DevhostFrame > id=59649\n"
                          "count class=DevhostDrawingView visible=any\n"
                          "tooltip\n");
    const RunResult run = RunDevhost({L"--drawings", L"3", L"--script", script});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    ASSERT_GE(run.lines.size(), 17u) << run.output;
    const Lines facts(run.lines.begin() + 12, run.lines.begin() + 17);
    EXPECT_EQ(facts, (Lines{"[script] text devhost", "[script] exists yes", "[script] exists no",
                            "[script] count 3", "[script] tooltip (none)"}))
        << run.output;
}

// The sample drawings lie beside the checkout; under Wine the Unix root is drive Z:.
std::wstring SampleFolder() {
    std::wstring path = L"Z:" + devhost::FromUtf8(ORVEX_SOURCE_DIR "/../shared/dwg-samples");
    for (wchar_t& c : path)
        if (c == L'/')
            c = L'\\';
    return path;
}

TEST(Devhost, DrawsTheStoredPreviewOfADrawing) {
    const std::wstring sample = SampleFolder() + L"\\2000\\Arc.dwg";
    if (GetFileAttributesW(sample.c_str()) == INVALID_FILE_ATTRIBUTES)
        GTEST_SKIP() << "no sample drawings at " << devhost::ToUtf8(SampleFolder());
    std::wstring escaped;
    for (wchar_t c : sample)
        escaped += c == L'\\' ? std::wstring(L"\\\\") : std::wstring(1, c);
    const RunResult run = RunDevhost(
        {L"--eval", L"(preview \"" + escaped + L"\")", L"--eval", L"(preview \"no-such-file.dwg\")"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    ASSERT_EQ(run.lines.size(), Opening().size() + 2 + Closing().size()) << run.output;
    EXPECT_EQ(run.lines[Opening().size()].rfind("=> (1 1 ", 0), 0u) << run.output; // more than the background
    EXPECT_EQ(run.lines[Opening().size() + 1].rfind("=> (0 ", 0), 0u) << run.output; // nothing to draw
}

// --preview flat: the preview operation fills the window with one colour (0x40 0x80 0xB0, as 0x00BBGGRR
// 0xB08040 = 11567168) and says it drew, without opening the file, which here does not even exist.
TEST(Devhost, FlatPreviewFillsTheWindowWithoutReadingTheFile) {
    const RunResult run =
        RunDevhost({L"--preview", L"flat", L"--timing", L"--eval", L"(preview \"no-such-file.dwg\")"});
    EXPECT_EQ(run.exitCode, 0u) << run.errors;
    std::vector<std::string> values, timing;
    for (const std::string& line : run.lines) {
        if (line.rfind("=> ", 0) == 0)
            values.push_back(line);
        if (line.rfind("[timing] ", 0) == 0 && line.find(" preview ") != std::string::npos)
            timing.push_back(line);
    }
    EXPECT_EQ(values, (std::vector<std::string>{"=> (1 0 11567168)"})) << run.output;
    ASSERT_EQ(timing.size(), 1u) << run.output; // the benchmark still sees each picture drawn
    EXPECT_NE(timing[0].find("no-such-file.dwg"), std::string::npos) << run.output;
}

TEST(Devhost, BadScriptIsAUsageError) {
    const std::wstring script = TempFile(L"bad.txt");
    WriteFileText(script, "sleep 1\nfly away\n");
    const RunResult run = RunDevhost({L"--script", script});
    EXPECT_EQ(run.exitCode, 2u);
    EXPECT_TRUE(run.lines.empty()) << run.output;
    EXPECT_NE(run.errors.find("line 2: unknown command fly"), std::string::npos) << run.errors;
    DeleteFileW(script.c_str());
}

TEST(Devhost, MissingLibraryAndMissingExport) {
    const RunResult missing = RunDevhost({L"--arx", L"C:\\no\\such\\library.arx"}, false);
    EXPECT_EQ(missing.exitCode, 3u);
    EXPECT_EQ(missing.errors, "devhost: cannot load C:\\no\\such\\library.arx: no such file\n");
    wchar_t system[MAX_PATH] = {};
    GetSystemDirectoryW(system, MAX_PATH);
    const std::wstring other = std::wstring(system) + L"\\version.dll";
    const RunResult noEntry = RunDevhost({L"--arx", other}, false);
    EXPECT_EQ(noEntry.exitCode, 3u);
    EXPECT_EQ(noEntry.errors, "devhost: " + devhost::ToUtf8(other) + " does not export acrxEntryPoint\n");
}

TEST(Devhost, BadCommandLine) {
    const RunResult run = RunDevhost({L"--drawings", L"zero"});
    EXPECT_EQ(run.exitCode, 2u);
    EXPECT_EQ(run.errors.rfind("devhost: --drawings takes a number from 1 to 64, not zero\n", 0), 0u)
        << run.errors;
}

} // namespace
