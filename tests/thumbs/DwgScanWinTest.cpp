// The folder scan over real folders (Windows build, runs under Wine): a folder shown through the folder
// model with the runtime's file search.
#include "thumbs/DrawingFolder.h"
#include "thumbs/DwgList.h"
#include "thumbs/NameFold.h"

#include "tests/support/ProcessResources.h"
#include "tests/support/TempFolder.h"

#include <windows.h>

#include <io.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace {

using testsupport::TempFolder;

// Shows path as the explorer does: 1 when it was read, 0 when not; problem gets what the user is told.
int ScanFolderPath(const char* path, const char*, std::string* problem = nullptr) {
    static FileSystemFolderReader reader;
    static DrawingFolder folder(reader, nullptr);
    const bool read = folder.Show(path);
    if (problem)
        *problem = folder.Problem();
    return read ? 1 : 0;
}

std::vector<std::string> SortedNames() {
    std::vector<std::string> names;
    for (int i = 0; i < DwgList.GetSize(); ++i)
        names.push_back(DwgList[i].m_strName);
    std::sort(names.begin(), names.end());
    return names;
}

TEST(DwgScanWin, ListsDrawingFilesLowerCased) {
    TempFolder folder;
    folder.Write("A.DWG", std::string(10, 'x'));
    folder.Write("b.dwg", std::string(20, 'x'));
    folder.Write("c.Dwg.old", std::string(30, 'x'));
    folder.Write("notes.txt", std::string(5, 'x'));
    folder.MakeDir("x.dwg");
    folder.MakeDir(".x.dwg");
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{".x.dwg", "a.dwg", "b.dwg", "c.dwg.old"}));
    for (int i = 0; i < DwgList.GetSize(); ++i) {
        if (DwgList[i].m_strName == "b.dwg") {
            EXPECT_EQ(DwgList[i].m_nSize, 20u);
            EXPECT_GT(DwgList[i].m_timeWrite, 1500000000);
        }
    }
    EXPECT_EQ(DwgList.GetAllocated(), static_cast<std::size_t>(DwgList.GetSize()));
}

// Makes path a file of size bytes without writing them: on the Linux file system under Wine the
// file is sparse and takes no room.
bool MakeSparseFile(const std::string& path, std::uint64_t size) {
    HANDLE file =
        ::CreateFileA(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return false;
    LARGE_INTEGER end;
    end.QuadPart = static_cast<LONGLONG>(size);
    const bool made = ::SetFilePointerEx(file, end, nullptr, FILE_BEGIN) && ::SetEndOfFile(file);
    ::CloseHandle(file);
    return made;
}

TEST(DwgScanWin, SizesOfTwoGibibytesAndMoreAreReadWhole) {
    TempFolder folder;
    folder.Write("small.dwg", std::string(19, 'x'));
    ASSERT_TRUE(MakeSparseFile(folder.File("three.dwg"), 3221225472ull));
    ASSERT_TRUE(MakeSparseFile(folder.File("five.dwg"), 5368709120ull));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    ASSERT_EQ(DwgList.GetSize(), 3);
    SortDwgList(DwgSortBySize);
    EXPECT_EQ(DwgList[0].m_strName, "small.dwg");
    EXPECT_EQ(DwgList[0].m_nSize, 19u);
    EXPECT_EQ(DwgList[1].m_strName, "three.dwg");
    EXPECT_EQ(DwgList[1].m_nSize, 3221225472ull);
    EXPECT_EQ(DwgList[2].m_strName, "five.dwg");
    EXPECT_EQ(DwgList[2].m_nSize, 5368709120ull);
}

TEST(DwgScanWin, MakesFolderCurrentDirectory) {
    TempFolder folder;
    folder.Write("a.dwg", std::string(1, 'x'));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    char current[MAX_PATH];
    GetCurrentDirectoryA(MAX_PATH, current);
    EXPECT_EQ(_stricmp(current, folder.Dir().c_str()), 0);
}

TEST(DwgScanWin, MissingFolderGivesZeroAndEmptyList) {
    TempFolder folder;
    folder.Write("a.dwg", std::string(1, 'x'));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    EXPECT_EQ(ScanFolderPath((folder.Dir() + "\\no-such-folder").c_str(), ".dwg"), 0);
    EXPECT_EQ(DwgList.GetSize(), 0);
}

TEST(NameFoldWin, TheTableIsTheSystemCodePagesLowerCase) {
    const NameFoldTable& fold = NameFold();
    for (int c = 1; c < 256; ++c) {
        const auto byte = static_cast<unsigned char>(c);
        EXPECT_EQ(fold.leadByte[c], IsDBCSLeadByteEx(CP_ACP, byte) != FALSE) << c;
        if (fold.leadByte[c])
            continue;
        char one[2] = {static_cast<char>(byte), 0};
        CharLowerBuffA(one, 1);
        EXPECT_EQ(fold.lower[c], static_cast<unsigned char>(one[0])) << c;
    }
    if (GetACP() == 1252) {
        const NameFoldTable western = Windows1252NameFold();
        for (int c = 0; c < 256; ++c)
            EXPECT_EQ(fold.lower[c], western.lower[c]) << c;
    }
}

TEST(DwgScanWin, LowersTheCodePagesLettersOfAFileName) {
    if (GetACP() != 1252)
        GTEST_SKIP() << "the names of this test are in the Western code page; this system uses " << GetACP();
    TempFolder folder;
    folder.Write("\xC9TAGE.DWG", std::string(3, 'x'));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{"\xE9tage.dwg"}));
}

std::string CurrentDirectory() {
    char current[MAX_PATH] = "";
    GetCurrentDirectoryA(MAX_PATH, current);
    return current;
}

TEST(DwgScanWin, FolderPathsTooLongForThePathBuffersAreRefusedBeforeUse) {
    TempFolder folder;
    folder.Write("a.dwg", std::string(1, 'x'));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    const std::string before = CurrentDirectory();
    for (std::size_t length : {258u, 259u, 260u, 1000u}) {
        std::string path = folder.Dir() + "\\";
        path += std::string(length - path.size(), 'x');
        ASSERT_EQ(path.size(), length);
        std::string problem = "unset";
        EXPECT_EQ(ScanFolderPath(path.c_str(), ".dwg", &problem), 0) << length;
        EXPECT_EQ(problem, "The folder cannot be read: its path is " + std::to_string(length) +
                               " characters long, at most 257 are possible");
        EXPECT_EQ(DwgList.GetSize(), 0) << length;
        EXPECT_EQ(CurrentDirectory(), before) << "the current directory was not touched";
    }
    // Without a place for the message the refusal is the same.
    EXPECT_EQ(ScanFolderPath((folder.Dir() + std::string(1000, 'y')).c_str(), ".dwg"), 0);
    std::string problem = "unset";
    EXPECT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg", &problem), 1);
    EXPECT_EQ(problem, "");
}

// Creates a file by its wide long-path form, which the narrow functions cannot reach.
bool CreateLongFile(const std::string& path) {
    std::wstring wide = L"\\\\?\\";
    for (char c : path)
        wide += static_cast<wchar_t>(static_cast<unsigned char>(c));
    HANDLE h =
        CreateFileW(wide.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (h == INVALID_HANDLE_VALUE)
        return false;
    CloseHandle(h);
    return true;
}

bool DeleteLongFile(const std::string& path) {
    std::wstring wide = L"\\\\?\\";
    for (char c : path)
        wide += static_cast<wchar_t>(static_cast<unsigned char>(c));
    return DeleteFileW(wide.c_str()) != 0;
}

TEST(DwgScanWin, FilesWhoseFullPathIsTooLongAreLeftOutAndCounted) {
    TempFolder folder;
    folder.Write("short.dwg", std::string(1, 'x'));
    // A name that brings the full path to 259 characters fits; one more does not.
    const std::size_t room = kMaxPathChars - folder.Dir().size() - 1;
    ASSERT_GT(room, 10u);
    ASSERT_LT(room, 250u) << "the temporary folder is too short for this test";
    const std::string fits = std::string(room - 4, 'f') + ".dwg";
    const std::string tooLong = std::string(room - 3, 'g') + ".dwg";
    folder.Write(fits, std::string(1, 'x'));
    const std::string longPath = folder.Dir() + "\\" + tooLong;
    if (!CreateLongFile(longPath))
        GTEST_SKIP() << "the file system does not take a path of " << longPath.size() << " characters";
    std::string problem;
    EXPECT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg", &problem), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{fits, "short.dwg"}));
    EXPECT_EQ(problem, "1 drawing is not shown: the full path is longer than 259 characters");
    EXPECT_TRUE(DeleteLongFile(longPath));
}

} // namespace

namespace {

// Creates an empty file by its wide name, as another program on the system may name it.
bool WriteWide(const TempFolder& folder, const std::wstring& name) {
    const std::wstring dir(folder.Path().wstring());
    HANDLE h =
        CreateFileW((dir + L"\\" + name).c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, 0, nullptr);
    if (h == INVALID_HANDLE_VALUE)
        return false;
    DWORD written = 0;
    WriteFile(h, "AC1018", 6, &written, nullptr);
    CloseHandle(h);
    return true;
}

bool CodePageHolds(const std::wstring& name) {
    BOOL usedDefault = FALSE;
    char narrow[64];
    const int n = WideCharToMultiByte(CP_ACP, WC_NO_BEST_FIT_CHARS, name.c_str(), -1, narrow, sizeof narrow,
                                      nullptr, &usedDefault);
    return n > 0 && !usedDefault;
}

} // namespace

TEST(PickedName, AListedFileIsExactAndAnUnlistedOneMissing) {
    TempFolder folder;
    folder.Write("Plan-1.DWG", "AC1018");
    folder.MakeDir("x.dwg");
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{"plan-1.dwg"}));
    EXPECT_EQ(CheckPickedName(folder.Dir(), "plan-1.dwg"), PickedName::Exact);
    EXPECT_EQ(CheckPickedName(folder.Dir() + "\\", "plan-1.dwg"), PickedName::Exact);
    EXPECT_EQ(CheckPickedName(folder.Dir(), "x.dwg"), PickedName::Missing); // a folder is no drawing
    EXPECT_EQ(CheckPickedName(folder.Dir(), "plan-2.dwg"), PickedName::Missing);
    EXPECT_EQ(CheckPickedName(folder.Dir() + "\\gone", "plan-1.dwg"), PickedName::Missing);
    EXPECT_EQ(CheckPickedName("", "plan-1.dwg"), PickedName::Missing);
}

// A letter the code page lacks comes out of the narrow file search as a look-alike ('l' for the Polish
// l with stroke) or as '?': the listed name names another file or none, and a pick must say so.
TEST(PickedName, NamesTheCodePageCannotHoldAreNeverExact) {
    const std::wstring lookAlike = L"\u0142uk.dwg";               // l with stroke
    const std::wstring foreign = L"\u0447\u0435\u0440\u0442.dwg"; // Cyrillic
    if (CodePageHolds(lookAlike) || CodePageHolds(foreign))
        GTEST_SKIP() << "this system's code page (" << GetACP() << ") holds the test's letters";
    TempFolder folder;
    ASSERT_TRUE(WriteWide(folder, lookAlike));
    ASSERT_TRUE(WriteWide(folder, foreign));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    const std::vector<std::string> names = SortedNames();
    ASSERT_EQ(names.size(), 2u);
    for (const std::string& name : names)
        EXPECT_EQ(CheckPickedName(folder.Dir(), name), PickedName::NotInCodePage) << name;

    // The look-alike's narrow name beside a file that really has it: neither can be told apart.
    const std::string& narrowLookAlike = names[0].find('?') == std::string::npos ? names[0] : names[1];
    folder.Write(narrowLookAlike, "AC1018");
    EXPECT_EQ(CheckPickedName(folder.Dir(), narrowLookAlike), PickedName::NotInCodePage) << narrowLookAlike;
}

TEST(PickedName, LettersOfTheCodePageOutsideAsciiAreExact) {
    const std::wstring accented = L"caf\u00e9-\u00c9t\u00e9.dwg";
    if (!CodePageHolds(accented))
        GTEST_SKIP() << "this system's code page (" << GetACP() << ") lacks the test's letters";
    TempFolder folder;
    ASSERT_TRUE(WriteWide(folder, accented));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    ASSERT_EQ(DwgList.GetSize(), 1);
    EXPECT_EQ(CheckPickedName(folder.Dir(), DwgList[0].m_strName), PickedName::Exact) << DwgList[0].m_strName;
}

// ---- the wide search, its count, its stop and its thread ---------------------------------------------

namespace {

// The scan's rules over the runtime's narrow search, as the folder was read before the wide search.
std::vector<DwgData> NarrowSearch(const std::string& folder) {
    std::vector<DwgData> drawings;
    struct __finddata64_t found;
    const intptr_t search = _findfirst64((folder + "\\*").c_str(), &found);
    if (search == -1)
        return drawings;
    do {
        DwgFindEntry entry;
        entry.name = found.name;
        entry.isDirectory = (found.attrib & _A_SUBDIR) != 0;
        entry.timeWrite = found.time_write;
        entry.size = static_cast<std::uint64_t>(found.size);
        if (AcceptScanEntry(entry, kDrawingNeedle))
            drawings.emplace_back(std::move(entry));
    } while (_findnext64(search, &found) == 0);
    _findclose(search);
    return drawings;
}

std::vector<std::string> Described(const std::vector<DwgData>& drawings) {
    std::vector<std::string> lines;
    for (const DwgData& d : drawings)
        lines.push_back(d.m_strName + " " + std::to_string(d.m_nSize) + " " + std::to_string(d.m_timeWrite));
    return lines;
}

// Waits up to ms for the scan's end.
bool EndsWithin(const FolderScan& scan, int ms) {
    for (int waited = 0; waited < ms; waited += 5) {
        if (scan.ended.load())
            return true;
        Sleep(5);
    }
    return scan.ended.load();
}

// Waits up to ms for the process's threads to come back to count.
bool ThreadsBackTo(long count, int ms) {
    for (int waited = 0; waited < ms; waited += 10) {
        if (testsupport::CountThreads() == count)
            return true;
        Sleep(10);
    }
    return testsupport::CountThreads() == count;
}

} // namespace

TEST(DwgScanWin, TheWideSearchListsWhatTheRuntimesNarrowSearchListed) {
    TempFolder folder;
    folder.Write("Plan-1.DWG", std::string(10, 'x'));
    folder.Write("b.dwg.bak", std::string(20, 'x'));
    folder.Write("notes.txt", "x");
    folder.MakeDir("x.dwg");
    folder.MakeDir(".x.dwg");
    ASSERT_TRUE(WriteWide(folder, L"caf\u00e9.dwg"));
    ASSERT_TRUE(WriteWide(folder, L"\u0447\u0435\u0440\u0442.dwg")); // '?' where the code page lacks them
    ASSERT_TRUE(WriteWide(folder, L"\u56f3\u8868\u4e00\u89a7.dwg"));
    ASSERT_TRUE(MakeSparseFile(folder.File("big.dwg"), 5ULL << 30));
    FileSystemFolderReader reader;
    std::vector<DwgData> drawings;
    std::string problem;
    ScanProgress progress;
    ASSERT_TRUE(reader.Read(folder.Dir(), drawings, problem, progress));
    EXPECT_EQ(problem, "");
    // The same names, sizes, write times and order (the file system's) as the narrow search gave.
    EXPECT_EQ(Described(drawings), Described(NarrowSearch(folder.Dir())));
    EXPECT_EQ(drawings.size(), 7u);
    EXPECT_EQ(progress.found.load(), 7); // the count the status bar shows
}

TEST(DwgScanWin, JapaneseNamesComeOutInTheCodePagesBytes) {
    const std::wstring name = L"\u56f3\u8868\u4e00\u89a7-\u30bd\u30d5\u30c8.dwg"; // 図表一覧-ソフト
    if (!CodePageHolds(name))
        GTEST_SKIP() << "this system's code page (" << GetACP() << ") lacks the test's letters";
    TempFolder folder;
    ASSERT_TRUE(WriteWide(folder, name));
    ASSERT_EQ(ScanFolderPath(folder.Dir().c_str(), ".dwg"), 1);
    ASSERT_EQ(DwgList.GetSize(), 1);
    char narrow[64] = {};
    WideCharToMultiByte(CP_ACP, 0, name.c_str(), -1, narrow, sizeof narrow, nullptr, nullptr);
    std::string folded = narrow;
    FoldNameInPlace(folded);
    EXPECT_EQ(DwgList[0].m_strName, folded);
    EXPECT_EQ(CheckPickedName(folder.Dir(), DwgList[0].m_strName), PickedName::Exact);
}

TEST(DwgScanWin, AnAbandonedReadStopsAtItsNextEntryAndListsNothing) {
    TempFolder folder;
    for (int i = 0; i < 20; ++i)
        folder.Write("d" + std::to_string(i) + ".dwg", "AC1018");
    FileSystemFolderReader reader;
    std::vector<DwgData> drawings;
    std::string problem;
    ScanProgress progress;
    progress.abandoned = true;
    EXPECT_FALSE(reader.Read(folder.Dir(), drawings, problem, progress));
    EXPECT_TRUE(drawings.empty());
    EXPECT_EQ(progress.found.load(), 0);
}

TEST(DwgScanWin, StartReadsOnAThreadOfItsOwnThatEndsAndLeavesNoHandle) {
    TempFolder folder;
    for (int i = 0; i < 300; ++i)
        folder.Write("d" + std::to_string(i) + ".dwg", "AC1018");
    FileSystemFolderReader reader;
    const long threads = testsupport::CountThreads();
    const long handlesBefore = testsupport::CountHandles();
    ASSERT_GT(handlesBefore, 0);

    // Waited for: it has ended when Start returns.
    auto waited = std::make_shared<FolderScan>(folder.Dir());
    reader.Start(waited, 10000);
    ASSERT_TRUE(waited->ended.load());
    EXPECT_TRUE(waited->read);
    EXPECT_EQ(waited->drawings.size(), 300u);

    // Not waited for: it goes on after Start returns and ends by itself.
    auto left = std::make_shared<FolderScan>(folder.Dir());
    reader.Start(left, 0);
    ASSERT_TRUE(EndsWithin(*left, 20000));
    EXPECT_TRUE(left->read);
    EXPECT_EQ(Described(left->drawings), Described(waited->drawings));

    // Abandoned: its thread reads nothing more and ends.
    auto abandoned = std::make_shared<FolderScan>(folder.Dir());
    abandoned->progress.abandoned = true;
    reader.Start(abandoned, 0);
    ASSERT_TRUE(EndsWithin(*abandoned, 20000));
    EXPECT_FALSE(abandoned->read);
    EXPECT_TRUE(abandoned->drawings.empty());

    EXPECT_TRUE(ThreadsBackTo(threads, 5000))
        << "threads before " << threads << ", now " << testsupport::CountThreads();
    EXPECT_EQ(testsupport::CountHandles(), handlesBefore); // no thread or search handle stays open
}
