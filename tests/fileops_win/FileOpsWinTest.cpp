// The file commands under Wine: the shell's file operation with its name lists, the clipboard's file list
// as the explorer writes and reads it (and as the system reads it, in another process), paste, cut, delete
// to the trash, rename, copy to file, and the shell's context menu helper.
#include "fileops/DropBlock.h"
#include "fileops/ForFileCommands.h"
#include "fileops/ShellContextMenu.h"
#include "fileops/ShellFileOp.h"
#include "framework/afxwin.h"
#include "thumbs/DrawingFolder.h"
#include "tests/support/MessagePump.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <shlobj.h>

#include <cstdio>
#include <cstring>
#include <fstream>
#include <functional>
#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

using testsupport::TempFolder;

namespace {

void EmptyTheClipboard() {
    if (::OpenClipboard(nullptr)) {
        ::EmptyClipboard();
        ::CloseClipboard();
    }
}

// A list of wide names on the clipboard, as other programs put it there.
void PutWideList(const std::vector<std::wstring>& names) {
    std::wstring text;
    for (const auto& name : names)
        text += name + L'\0';
    text += L'\0';
    HGLOBAL block = ::GlobalAlloc(GMEM_MOVEABLE | GMEM_ZEROINIT, sizeof(DROPFILES) + text.size() * 2);
    auto* header = static_cast<DROPFILES*>(::GlobalLock(block));
    header->pFiles = sizeof(DROPFILES);
    header->fWide = TRUE;
    std::memcpy(header + 1, text.data(), text.size() * 2);
    ::GlobalUnlock(block);
    HWND owner = ::CreateWindowExA(0, "STATIC", "", 0, 0, 0, 0, 0, HWND_MESSAGE, nullptr, nullptr, nullptr);
    ASSERT_TRUE(::OpenClipboard(owner));
    ::EmptyClipboard();
    ::SetClipboardData(CF_HDROP, block);
    ::CloseClipboard();
    ::DestroyWindow(owner);
}

std::wstring Wide(const std::string& text) {
    return std::wstring(text.begin(), text.end());
}

std::string ReadFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream out;
    out << in.rdbuf();
    return out.str();
}

// The probe program lies beside the test program.
std::string Probe() {
    char path[MAX_PATH] = "";
    ::GetModuleFileNameA(nullptr, path, MAX_PATH);
    std::string folder(path);
    folder.erase(folder.find_last_of('\\') + 1);
    return "\"" + folder + CLIPBOARD_PROBE + "\"";
}

// Runs a program and returns its standard output.
std::string RunProgram(const std::string& commandLine) {
    std::string output;
    // cmd /c keeps the inner quotes only when the whole line is quoted once more.
    FILE* pipe = ::_popen(("\"" + commandLine + "\"").c_str(), "r");
    if (!pipe)
        return output;
    char buffer[512];
    while (std::fgets(buffer, sizeof buffer, pipe))
        output += buffer;
    ::_pclose(pipe);
    std::string clean;
    for (char c : output)
        if (c != '\r')
            clean += c;
    return clean;
}

// Answers the shell's dialogs of this thread while an operation runs: a thread timer finds the visible
// dialog and presses the button.
class DialogAnswer {
public:
    explicit DialogAnswer(int button) {
        s_button = button;
        s_seen.clear();
        m_timer = ::SetTimer(nullptr, 0, 100, &Tick);
    }
    ~DialogAnswer() { ::KillTimer(nullptr, m_timer); }
    static std::vector<std::string>& Seen() { return s_seen; }

private:
    static BOOL CALLBACK Visit(HWND hwnd, LPARAM) {
        char cls[32] = "";
        ::GetClassNameA(hwnd, cls, sizeof cls);
        if (std::strcmp(cls, "#32770") == 0 && ::IsWindowVisible(hwnd) && ::IsWindowEnabled(hwnd)) {
            char title[256] = "";
            ::GetWindowTextA(hwnd, title, sizeof title);
            s_seen.emplace_back(title);
            ::PostMessageA(hwnd, WM_COMMAND, MAKEWPARAM(s_button, BN_CLICKED), 0);
        }
        return TRUE;
    }
    static void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD) {
        ::EnumThreadWindows(::GetCurrentThreadId(), &Visit, 0);
    }
    static int s_button;
    static std::vector<std::string> s_seen;
    UINT_PTR m_timer = 0;
};
int DialogAnswer::s_button = IDOK;
std::vector<std::string> DialogAnswer::s_seen;

// The drawing list of a folder with these names selected.
// A folder shown with these drawings in it, some selected.
struct ListedFolder : FolderReader {
    std::vector<std::string> names;
    DrawingFolder folder{*this, nullptr};
    bool Read(const std::string&, std::vector<DwgData>& drawings, std::string&, ScanProgress&) override {
        for (const std::string& name : names) {
            DwgFindEntry entry;
            entry.name = name;
            drawings.emplace_back(entry);
        }
        return true;
    }
    void MakeCurrentDirectory(const std::string&) override {}
};

ListedFolder& Listed() {
    static ListedFolder listed;
    return listed;
}

const DrawingFolder& Shown() {
    return Listed().folder;
}

void ListWithSelection(const std::string& folder, const std::vector<std::string>& names,
                       const std::vector<bool>& selected) {
    Listed().names = names;
    Listed().folder.Show(folder);
    for (std::size_t i = 0; i < names.size(); ++i)
        if (selected[i])
            Listed().folder.Select(static_cast<int>(i));
}

} // namespace

// ---- the shell's file operation ---------------------------------------------------------------------

TEST(ShellFileOp, CopiesTwoFilesIntoAFolder) {
    TempFolder folder("orvex-fileop");
    const std::string a = folder.Write("a.dwg", "A"), b = folder.Write("b.txt", "B");
    const std::string target = folder.MakeDir("target");
    CShellFileOp op;
    op.AddName(CShellFileOp::kSource, a);
    op.AddName(CShellFileOp::kSource, b);
    op.AddName(CShellFileOp::kDestination, target);
    op.SetFlags(FOF_NOCONFIRMATION | FOF_SILENT);
    EXPECT_EQ(op.Source().Names(), (std::vector<std::string>{a, b}));
    EXPECT_EQ(op.Copy(), 0);
    EXPECT_FALSE(op.Aborted());
    EXPECT_EQ(ReadFile(target + "\\a.dwg"), "A");
    EXPECT_EQ(ReadFile(target + "\\b.txt"), "B");
    EXPECT_TRUE(folder.Exists("a.dwg"));
}

TEST(ShellFileOp, NothingAddedIsRefusedWithoutAskingTheShell) {
    CShellFileOp op;
    EXPECT_EQ(op.Source().Data(), nullptr);
    EXPECT_NE(op.Copy(), 0);
    op.AddName(CShellFileOp::kSource, "x");
    op.ClearList(CShellFileOp::kSource);
    EXPECT_EQ(op.Source().Data(), nullptr);
    EXPECT_NE(op.Rename(), 0);
}

TEST(ShellFileOp, AllInOneConstructorRunsItsCode) {
    TempFolder folder("orvex-fileop");
    const std::string a = folder.Write("a.dwg", "A");
    CShellFileOp copy(nullptr, CShellFileOp::kCopy, a.c_str(), folder.File("c.dwg").c_str(),
                      FOF_NOCONFIRMATION | FOF_SILENT, "Copying");
    EXPECT_EQ(copy.Result(), 0);
    EXPECT_EQ(ReadFile(folder.File("c.dwg")), "A");
    CShellFileOp rename(nullptr, CShellFileOp::kRename, folder.File("c.dwg").c_str(),
                        folder.File("d.dwg").c_str(), 0, nullptr);
    EXPECT_EQ(rename.Result(), 0);
    EXPECT_TRUE(folder.Exists("d.dwg"));
    EXPECT_FALSE(folder.Exists("c.dwg"));
    CShellFileOp move(nullptr, CShellFileOp::kMove, folder.File("d.dwg").c_str(), folder.MakeDir("m").c_str(),
                      FOF_NOCONFIRMATION | FOF_SILENT, "");
    EXPECT_EQ(move.Result(), 0);
    EXPECT_TRUE(folder.Exists("m\\d.dwg"));
    CShellFileOp nothing(nullptr, 7, a.c_str(), folder.File("e.dwg").c_str(), 0, nullptr);
    EXPECT_EQ(nothing.Result(), -1);
    EXPECT_FALSE(folder.Exists("e.dwg"));
}

TEST(ShellFileOp, DeleteAsksAndGoesToTheTrash) {
    TempFolder folder("orvex-fileop");
    const std::string a = folder.Write("gone.dwg", "A");
    CShellFileOp op;
    op.SetFlags(FOF_NOCONFIRMATION);
    op.AddName(CShellFileOp::kSource, a);
    int result = -1;
    {
        DialogAnswer yes(IDYES);
        result = op.Delete();
        EXPECT_EQ(DialogAnswer::Seen().size(), 1u) << "the shell asked before it deleted";
    }
    EXPECT_EQ(op.GetFlags(), FOF_ALLOWUNDO);
    EXPECT_EQ(result, 0);
    EXPECT_FALSE(folder.Exists("gone.dwg"));
}

TEST(ShellFileOp, DeleteAnsweredNoKeepsTheFile) {
    TempFolder folder("orvex-fileop");
    const std::string a = folder.Write("kept.dwg", "A");
    CShellFileOp op;
    op.AddName(CShellFileOp::kSource, a);
    {
        DialogAnswer no(IDNO);
        op.Delete();
    }
    EXPECT_TRUE(folder.Exists("kept.dwg"));
}

// ---- the clipboard's file list ----------------------------------------------------------------------

TEST(Clipboard, TheExplorersListIsOneAnsiBlockInStepsOf4096) {
    const std::vector<std::string> paths = {"C:\\dwg\\a.dwg", "C:\\dwg\\b.dwg"};
    ASSERT_TRUE(PutFileListOnClipboard(paths, false));
    ASSERT_TRUE(::OpenClipboard(nullptr));
    UINT formats = 0, first = ::EnumClipboardFormats(0);
    for (UINT f = first; f; f = ::EnumClipboardFormats(f))
        ++formats;
    HGLOBAL block = ::GetClipboardData(CF_HDROP);
    ASSERT_NE(block, nullptr);
    EXPECT_EQ(::GlobalSize(block) % 4096, 0u);
    const auto* drop = static_cast<const DROPFILES*>(::GlobalLock(block));
    EXPECT_EQ(drop->pFiles, 20u);
    EXPECT_EQ(drop->fWide, FALSE);
    EXPECT_EQ(std::memcmp(reinterpret_cast<const char*>(drop) + 20, "C:\\dwg\\a.dwg\0C:\\dwg\\b.dwg\0\0", 27),
              0);
    ::GlobalUnlock(block);
    char name[MAX_PATH] = "";
    EXPECT_EQ(::DragQueryFileA(static_cast<HDROP>(block), 0xFFFFFFFF, nullptr, 0), 2u);
    ::DragQueryFileA(static_cast<HDROP>(block), 1, name, MAX_PATH);
    EXPECT_STREQ(name, "C:\\dwg\\b.dwg");
    ::CloseClipboard();
    // CF_HDROP only (the system may add nothing to a file list).
    EXPECT_EQ(first, static_cast<UINT>(CF_HDROP));
    EXPECT_EQ(formats, 1u);
    EXPECT_EQ(ClipboardFileList(), paths);
}

TEST(Clipboard, AnotherProcessReadsTheListThroughDragQueryFileAAndW) {
    ASSERT_TRUE(PutFileListOnClipboard({"Z:\\orvex\\plan one.dwg", "Z:\\orvex\\notes.txt"}, false));
    const std::string out = RunProgram(Probe() + " read");
    EXPECT_EQ(out, "count-a 2\na Z:\\orvex\\plan one.dwg\na Z:\\orvex\\notes.txt\n"
                   "count-w 2\nw Z:\\orvex\\plan one.dwg\nw Z:\\orvex\\notes.txt\n");
}

TEST(Clipboard, TheSystemsFileOperationPastesTheList) {
    TempFolder folder("orvex-interop");
    const std::string a = folder.Write("a.dwg", "drawing"), b = folder.Write("b.txt", "text");
    const std::string target = folder.MakeDir("target");
    ASSERT_TRUE(PutFileListOnClipboard({a, b}, false));
    const std::string out = RunProgram(Probe() + " paste \"" + target + "\"");
    EXPECT_EQ(out, "pasted 2 result 0\n");
    EXPECT_EQ(ReadFile(target + "\\a.dwg"), "drawing");
    EXPECT_EQ(ReadFile(target + "\\b.txt"), "text");
}

TEST(Clipboard, ATextFileThenADrawingOffersPasteAndPastesBoth) {
    TempFolder folder("orvex-paste");
    const std::string a = folder.Write("notes.txt", "text"), b = folder.Write("PLAN.DWG", "drawing");
    const std::string target = folder.MakeDir("target");
    ASSERT_TRUE(PutFileListOnClipboard({a, b}, false));
    ForFileCommands commands;
    EXPECT_TRUE(commands.ClipboardHoldsDrawings());
    EXPECT_EQ(commands.PasteInto(target, nullptr), 0);
    EXPECT_EQ(ReadFile(target + "\\notes.txt"), "text");
    EXPECT_EQ(ReadFile(target + "\\PLAN.DWG"), "drawing");
    // A copy leaves the sources and the list.
    EXPECT_TRUE(folder.Exists("notes.txt"));
    EXPECT_EQ(ClipboardFileList().size(), 2u);
}

TEST(Clipboard, AWideListFromAnotherProgramOffersPasteAndIsPasted) {
    // The system's file manager puts wide lists there; before, they were read as ANSI and Paste was greyed.
    TempFolder folder("orvex-wide");
    const std::string a = folder.Write("a.dwg", "drawing"), b = folder.Write("notes.txt", "text");
    const std::string target = folder.MakeDir("target");
    const std::string out = RunProgram(Probe() + " put-wide \"" + a + "\" \"" + b + "\"");
    ASSERT_EQ(out, "put-wide 2 ok\n");
    ForFileCommands commands;
    EXPECT_TRUE(commands.ClipboardHoldsDrawings());
    EXPECT_EQ(ClipboardFileList(), (std::vector<std::string>{a, b}));
    EXPECT_TRUE(ClipboardDropList().wide);
    EXPECT_EQ(commands.PasteInto(target, nullptr), 0);
    EXPECT_EQ(ReadFile(target + "\\a.dwg"), "drawing");
    EXPECT_EQ(ReadFile(target + "\\notes.txt"), "text");
}

namespace {

// The names of a folder, wide, sorted.
std::vector<std::wstring> NamesIn(const std::wstring& folder) {
    std::vector<std::wstring> names;
    WIN32_FIND_DATAW found;
    HANDLE search = ::FindFirstFileW((folder + L"\\*").c_str(), &found);
    if (search == INVALID_HANDLE_VALUE)
        return names;
    do {
        if (std::wstring(found.cFileName) != L"." && std::wstring(found.cFileName) != L"..")
            names.push_back(found.cFileName);
    } while (::FindNextFileW(search, &found));
    ::FindClose(search);
    std::sort(names.begin(), names.end());
    return names;
}

} // namespace

TEST(Clipboard, AWideNameTheCodePageCannotHoldIsSaidAndNeverPastedUnderAnotherName) {
    const std::wstring chinese = L"\u4E2D\u6587.dwg";
    BOOL usedDefault = FALSE;
    char probe[32];
    ::WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, chinese.c_str(), -1, probe, sizeof probe, nullptr,
                          &usedDefault);
    if (!usedDefault)
        GTEST_SKIP() << "this system's code page holds the name";
    TempFolder folder("orvex-unheld");
    const std::string plan = folder.Write("plan.dwg", "drawing");
    const std::wstring wideFolder = Wide(folder.Dir());
    const std::wstring unheld = wideFolder + L"\\" + chinese;
    HANDLE file = ::CreateFileW(unheld.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW, 0, nullptr);
    ASSERT_NE(file, INVALID_HANDLE_VALUE);
    ::CloseHandle(file);
    const std::string target = folder.MakeDir("target");

    std::vector<std::wstring> told;
    ForFileCommands commands;
    commands.tellUser = [&told](const std::wstring& text) { told.push_back(text); };
    PutWideList({Wide(plan), unheld});
    EXPECT_TRUE(commands.ClipboardHoldsDrawings());
    EXPECT_EQ(ClipboardFileList(), std::vector<std::string>{plan});
    EXPECT_EQ(commands.PasteInto(target, nullptr), 0);
    EXPECT_EQ(NamesIn(Wide(target)), std::vector<std::wstring>{L"plan.dwg"}) << "nothing under another name";
    const std::string first = PasteRefusedMessage(1);
    EXPECT_EQ(told, std::vector<std::wstring>{std::wstring(first.begin(), first.end()) + L"\n" + unheld});

    // Alone, Paste is offered, says why, and pastes nothing.
    told.clear();
    const std::string empty = folder.MakeDir("empty");
    PutWideList({unheld});
    EXPECT_TRUE(commands.ClipboardHoldsDrawings());
    EXPECT_EQ(commands.PasteInto(empty, nullptr), kFileOpNotDone);
    EXPECT_EQ(told.size(), 1u);
    EXPECT_TRUE(NamesIn(Wide(empty)).empty());
}

TEST(Clipboard, NoFileListOffersNoPaste) {
    EmptyTheClipboard();
    EXPECT_FALSE(ForFileCommands().ClipboardHoldsDrawings());
    EXPECT_EQ(ForFileCommands().PasteInto("C:\\", nullptr), kFileOpNotDone);
    ASSERT_TRUE(PutFileListOnClipboard({"C:\\x\\notes.txt"}, false));
    EXPECT_FALSE(ForFileCommands().ClipboardHoldsDrawings());
}

TEST(Clipboard, CutThenPasteMovesAndEmptiesTheClipboard) {
    TempFolder folder("orvex-cut");
    const std::string a = folder.Write("a.dwg", "drawing");
    const std::string target = folder.MakeDir("target");
    ASSERT_TRUE(PutFileListOnClipboard({a}, true));
    EXPECT_EQ(ForFileCommands().PasteInto(target, nullptr), 0);
    EXPECT_EQ(ReadFile(target + "\\a.dwg"), "drawing");
    EXPECT_FALSE(folder.Exists("a.dwg"));
    EXPECT_TRUE(ClipboardFileList().empty());
}

TEST(Clipboard, ACutReplacedOnTheClipboardIsNoLongerAMove) {
    TempFolder folder("orvex-cut");
    const std::string a = folder.Write("a.dwg", "drawing");
    const std::string target = folder.MakeDir("target");
    ASSERT_TRUE(PutFileListOnClipboard({a}, true));
    ASSERT_TRUE(PutFileListOnClipboard({a}, false)); // a copy after the cut
    EXPECT_EQ(ForFileCommands().PasteInto(target, nullptr), 0);
    EXPECT_TRUE(folder.Exists("a.dwg"));
    EXPECT_TRUE(folder.Exists("target\\a.dwg"));
}

TEST(Clipboard, PasteOntoAnExistingNameAsksTheShell) {
    TempFolder folder("orvex-collide");
    const std::string a = folder.Write("a.dwg", "new");
    const std::string target = folder.MakeDir("target");
    folder.Write("target\\a.dwg", "old");
    ASSERT_TRUE(PutFileListOnClipboard({a}, false));
    {
        DialogAnswer no(IDNO);
        ForFileCommands().PasteInto(target, nullptr);
        EXPECT_GE(DialogAnswer::Seen().size(), 1u) << "the shell asked before replacing";
    }
    EXPECT_EQ(ReadFile(target + "\\a.dwg"), "old");
}

// ---- the grid's commands on the selection ------------------------------------------------------------

TEST(Selection, CopyWritesTheSelectedDrawingsAsFullPathsInListOrder) {
    ListWithSelection("C:\\dwg", {"a.dwg", "b.dwg", "c.dwg"}, {true, false, true});
    ASSERT_TRUE(PutFileListOnClipboard(Shown().SelectedPaths(), false));
    EXPECT_EQ(ClipboardFileList(), (std::vector<std::string>{"C:\\dwg\\a.dwg", "C:\\dwg\\c.dwg"}));
    // A drive root keeps its one backslash.
    ListWithSelection("C:\\", {"a.dwg", "b.dwg", "c.dwg"}, {true, false, true});
    ASSERT_TRUE(PutFileListOnClipboard(Shown().SelectedPaths(), false));
    EXPECT_EQ(ClipboardFileList(), (std::vector<std::string>{"C:\\a.dwg", "C:\\c.dwg"}));
}

TEST(Selection, CopyWithoutSelectionIsTheHeaderAlone) {
    ListWithSelection("C:\\dwg", {"a.dwg"}, {false});
    ASSERT_TRUE(PutFileListOnClipboard(Shown().SelectedPaths(), false));
    EXPECT_TRUE(ClipboardFileList().empty());
    EXPECT_FALSE(ForFileCommands().ClipboardHoldsDrawings());
}

TEST(Selection, DeleteSendsTheSelectedDrawingsToTheTrash) {
    TempFolder folder("orvex-delete");
    folder.Write("a.dwg", "A");
    folder.Write("b.dwg", "B");
    ListWithSelection(folder.Dir(), {"a.dwg", "b.dwg"}, {false, true});
    int result = -1;
    {
        DialogAnswer yes(IDYES);
        result = DeleteFiles(nullptr, Shown().SelectedPaths());
    }
    EXPECT_EQ(result, 0);
    EXPECT_TRUE(folder.Exists("a.dwg"));
    EXPECT_FALSE(folder.Exists("b.dwg"));
}

TEST(Selection, DeleteWithoutSelectionAsksNothing) {
    ListWithSelection("C:\\dwg", {"a.dwg"}, {false});
    DialogAnswer yes(IDYES);
    EXPECT_EQ(DeleteFiles(nullptr, Shown().SelectedPaths()), kFileOpNotDone);
    EXPECT_TRUE(DialogAnswer::Seen().empty());
}

// ---- rename -----------------------------------------------------------------------------------------

TEST(Rename, ThroughTheShell) {
    TempFolder folder("orvex-rename");
    folder.Write("a.dwg", "A");
    EXPECT_EQ(ForFileCommands().RenameFile(folder.File("a.dwg"), folder.File("b.dwg"), nullptr), 0);
    EXPECT_EQ(ReadFile(folder.File("b.dwg")), "A");
    EXPECT_FALSE(folder.Exists("a.dwg"));
}

TEST(Rename, OntoAnExistingNameFailsAndTheLabelGetsTheOldName) {
    TempFolder folder("orvex-rename");
    folder.Write("a.dwg", "A");
    folder.Write("b.dwg", "B");
    CEdit label;
    ASSERT_TRUE(label.CreateEx(0, "EDIT", "b.dwg", WS_POPUP, CRect(0, 0, 100, 20), nullptr, 0));
    int result = 0;
    {
        DialogAnswer ok(IDOK); // any error box the shell shows
        result = ForFileCommands().RenameFile(folder.File("a.dwg"), folder.File("b.dwg"), &label);
    }
    EXPECT_NE(result, 0);
    EXPECT_EQ(label.GetWindowText(), "a.dwg");
    EXPECT_EQ(ReadFile(folder.File("a.dwg")), "A");
    EXPECT_EQ(ReadFile(folder.File("b.dwg")), "B");
    label.DestroyWindow();
}

// ---- copy to file -----------------------------------------------------------------------------------

namespace {

// Fills the save dialog's name and presses Save; answers the overwrite question with `answer`.
struct SaveDialogDriver {
    static std::string s_name;
    static int s_answer;
    static std::vector<std::string> s_titles;
    static BOOL CALLBACK Visit(HWND hwnd, LPARAM) {
        char cls[32] = "", title[256] = "";
        ::GetClassNameA(hwnd, cls, sizeof cls);
        if (std::strcmp(cls, "#32770") != 0 || !::IsWindowVisible(hwnd) || !::IsWindowEnabled(hwnd))
            return TRUE;
        ::GetWindowTextA(hwnd, title, sizeof title);
        s_titles.emplace_back(title);
        if (std::strcmp(title, kCopyFileTitle) == 0) {
            // The file name field: edt1, or the combo box cmb13 of the explorer-style dialog.
            HWND edit = ::GetDlgItem(hwnd, 0x480);
            if (!edit)
                edit = ::GetDlgItem(hwnd, 0x47c);
            if (edit)
                ::SetWindowTextA(edit, s_name.c_str());
            ::PostMessageA(hwnd, WM_COMMAND, MAKEWPARAM(IDOK, BN_CLICKED), 0);
        } else {
            ::PostMessageA(hwnd, WM_COMMAND, MAKEWPARAM(s_answer, BN_CLICKED), 0);
        }
        return TRUE;
    }
    static void CALLBACK Tick(HWND, UINT, UINT_PTR, DWORD) {
        ::EnumThreadWindows(::GetCurrentThreadId(), &Visit, 0);
    }
};
std::string SaveDialogDriver::s_name;
int SaveDialogDriver::s_answer = IDNO;
std::vector<std::string> SaveDialogDriver::s_titles;

void CopyToFileAs(const std::string& source, const std::string& name, int answer) {
    SaveDialogDriver::s_name = name;
    SaveDialogDriver::s_answer = answer;
    SaveDialogDriver::s_titles.clear();
    const UINT_PTR timer = ::SetTimer(nullptr, 0, 300, &SaveDialogDriver::Tick);
    EXPECT_EQ(ForFileCommands().CopyToFile(source, nullptr), 1);
    ::KillTimer(nullptr, timer);
}

} // namespace

TEST(CopyToFile, ANameWithoutExtensionGetsDWG) {
    TempFolder folder("orvex-copyto");
    const std::string source = folder.Write("a.dwg", "A");
    CopyToFileAs(source, folder.File("copy"), IDNO);
    ASSERT_FALSE(SaveDialogDriver::s_titles.empty());
    EXPECT_EQ(SaveDialogDriver::s_titles[0], kCopyFileTitle);
    EXPECT_EQ(ReadFile(folder.File("copy.DWG")), "A");
}

TEST(CopyToFile, AnExistingTargetAnsweredNoIsLeftAlone) {
    TempFolder folder("orvex-copyto");
    const std::string source = folder.Write("a.dwg", "A");
    folder.Write("b.dwg", "B");
    CopyToFileAs(source, folder.File("b.dwg"), IDNO);
    EXPECT_EQ(ReadFile(folder.File("b.dwg")), "B");
    bool asked = false;
    for (const auto& title : SaveDialogDriver::s_titles)
        asked = asked || title == kOverwriteCaption;
    EXPECT_TRUE(asked);
    CopyToFileAs(source, folder.File("b.dwg"), IDYES);
    EXPECT_EQ(ReadFile(folder.File("b.dwg")), "A");
}

// ---- the shell's context menu helper ----------------------------------------------------------------

TEST(ShellContextMenu, GetsTheItemsMenuAndSubclassesItsOwner) {
    ASSERT_TRUE(SUCCEEDED(::CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED)) || true);
    TempFolder folder("orvex-menu");
    folder.Write("a.dwg", "A");
    IShellFolder* desktop = nullptr;
    ASSERT_EQ(::SHGetDesktopFolder(&desktop), S_OK);
    PIDLIST_RELATIVE folderId = nullptr;
    std::wstring wideFolder = Wide(folder.Dir());
    ASSERT_EQ(desktop->ParseDisplayName(nullptr, nullptr, wideFolder.data(), nullptr, &folderId, nullptr),
              S_OK);
    IShellFolder* parent = nullptr;
    ASSERT_EQ(desktop->BindToObject(folderId, nullptr, IID_IShellFolder, reinterpret_cast<void**>(&parent)),
              S_OK);
    PIDLIST_RELATIVE item = nullptr;
    std::wstring name = L"a.dwg";
    ASSERT_EQ(parent->ParseDisplayName(nullptr, nullptr, name.data(), nullptr, &item, nullptr), S_OK);

    CShellContextMenu menu;
    EXPECT_TRUE(menu.SetObject(parent, item));
    EXPECT_NE(menu.Menu(), nullptr);
    HMENU popup = ::CreatePopupMenu();
    EXPECT_TRUE(SUCCEEDED(menu.QueryMenu(popup, 1, 0x7FFF)));
    EXPECT_GT(::GetMenuItemCount(popup), 0);
    ::DestroyMenu(popup);

    HWND owner =
        ::CreateWindowExA(0, "STATIC", "owner", WS_POPUP, 0, 0, 10, 10, nullptr, nullptr, nullptr, nullptr);
    const LONG_PTR before = ::GetWindowLongPtrA(owner, GWLP_WNDPROC);
    ASSERT_TRUE(menu.Attach(owner));
    EXPECT_EQ(::GetPropA(owner, "ShellContextMenu"), &menu);
    EXPECT_NE(::GetWindowLongPtrA(owner, GWLP_WNDPROC), before);
    // Messages it does not take go on to the old procedure.
    EXPECT_EQ(::SetWindowTextA(owner, "still answers"), TRUE);
    char text[32] = "";
    ::GetWindowTextA(owner, text, sizeof text);
    EXPECT_STREQ(text, "still answers");
    menu.Detach();
    EXPECT_EQ(::GetPropA(owner, "ShellContextMenu"), nullptr);
    EXPECT_EQ(::GetWindowLongPtrA(owner, GWLP_WNDPROC), before);
    // Destroying an attached owner detaches it.
    ASSERT_TRUE(menu.Attach(owner));
    ::DestroyWindow(owner);
    EXPECT_EQ(menu.Owner(), nullptr);

    EXPECT_FALSE(menu.SetObject(nullptr, item));
    EXPECT_EQ(menu.Menu(), nullptr);
    ::CoTaskMemFree(item);
    ::CoTaskMemFree(folderId);
    parent->Release();
    desktop->Release();
}

TEST(Properties, TheShellsSheetOfTheFullPathOpens) {
    TempFolder folder("orvex-props");
    const std::string a = folder.Write("a.dwg", "A");
    {
        DialogAnswer cancel(IDCANCEL);
        EXPECT_TRUE(ShowFileProperties(a));
        testsupport::PumpUntil([] { return !DialogAnswer::Seen().empty(); }, 1500);
        ASSERT_FALSE(DialogAnswer::Seen().empty());
        EXPECT_NE(DialogAnswer::Seen()[0].find("a.dwg"), std::string::npos) << DialogAnswer::Seen()[0];
    }
    EXPECT_FALSE(ShowFileProperties(folder.File("missing.dwg")));
}
