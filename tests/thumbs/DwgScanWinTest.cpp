// The folder scan over real folders (Windows build, runs under Wine).
#include "thumbs/DwgList.h"

#include <windows.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

namespace {

// A fresh folder under the temporary directory, removed with its files at the end.
class TempFolder {
public:
    TempFolder() {
        char base[MAX_PATH];
        GetTempPathA(MAX_PATH, base);
        m_path = std::string(base) + "orvex-scan-" + std::to_string(GetCurrentProcessId());
        CreateDirectoryA(m_path.c_str(), nullptr);
    }
    TempFolder(const TempFolder&) = delete;
    TempFolder& operator=(const TempFolder&) = delete;
    ~TempFolder() {
        char previous[MAX_PATH];
        GetTempPathA(MAX_PATH, previous);
        SetCurrentDirectoryA(previous);
        for (const std::string& f : m_files)
            DeleteFileA(f.c_str());
        for (auto it = m_dirs.rbegin(); it != m_dirs.rend(); ++it)
            RemoveDirectoryA(it->c_str());
        RemoveDirectoryA(m_path.c_str());
    }
    void File(const std::string& name, std::size_t size) {
        const std::string full = m_path + "\\" + name;
        HANDLE h = CreateFileA(full.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL,
                               nullptr);
        ASSERT_NE(h, INVALID_HANDLE_VALUE);
        std::string bytes(size, 'x');
        DWORD written = 0;
        WriteFile(h, bytes.data(), static_cast<DWORD>(bytes.size()), &written, nullptr);
        CloseHandle(h);
        m_files.push_back(full);
    }
    void Dir(const std::string& name) {
        const std::string full = m_path + "\\" + name;
        CreateDirectoryA(full.c_str(), nullptr);
        m_dirs.push_back(full);
    }
    const std::string& path() const { return m_path; }

private:
    std::string m_path;
    std::vector<std::string> m_files;
    std::vector<std::string> m_dirs;
};

std::vector<std::string> SortedNames() {
    std::vector<std::string> names;
    for (int i = 0; i < DwgList.GetSize(); ++i)
        names.push_back(DwgList[i].m_strName);
    std::sort(names.begin(), names.end());
    return names;
}

TEST(DwgScanWin, ListsDrawingFilesLowerCased) {
    TempFolder folder;
    folder.File("A.DWG", 10);
    folder.File("b.dwg", 20);
    folder.File("c.Dwg.old", 30);
    folder.File("notes.txt", 5);
    folder.Dir("x.dwg");
    folder.Dir(".x.dwg");
    ASSERT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg"), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{".x.dwg", "a.dwg", "b.dwg", "c.dwg.old"}));
    for (int i = 0; i < DwgList.GetSize(); ++i) {
        if (DwgList[i].m_strName == "b.dwg") {
            EXPECT_EQ(DwgList[i].m_nSize, 20u);
            EXPECT_GT(DwgList[i].m_timeWrite, 1500000000);
        }
    }
    EXPECT_EQ(DwgList.GetAllocated(), static_cast<std::size_t>(DwgList.GetSize()));
}

TEST(DwgScanWin, MakesFolderCurrentDirectory) {
    TempFolder folder;
    folder.File("a.dwg", 1);
    ASSERT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg"), 1);
    char current[MAX_PATH];
    GetCurrentDirectoryA(MAX_PATH, current);
    EXPECT_EQ(_stricmp(current, folder.path().c_str()), 0);
}

TEST(DwgScanWin, MissingFolderGivesZeroAndEmptyList) {
    TempFolder folder;
    folder.File("a.dwg", 1);
    ASSERT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg"), 1);
    EXPECT_EQ(ScanFolderPath((folder.path() + "\\no-such-folder").c_str(), ".dwg"), 0);
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
    folder.File("\xC9TAGE.DWG", 3);
    ASSERT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg"), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{"\xE9tage.dwg"}));
}

std::string CurrentDirectory() {
    char current[MAX_PATH] = "";
    GetCurrentDirectoryA(MAX_PATH, current);
    return current;
}

TEST(DwgScanWin, FolderPathsTooLongForThePathBuffersAreRefusedBeforeUse) {
    TempFolder folder;
    folder.File("a.dwg", 1);
    ASSERT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg"), 1);
    const std::string before = CurrentDirectory();
    for (std::size_t length : {258u, 259u, 260u, 1000u}) {
        std::string path = folder.path() + "\\";
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
    EXPECT_EQ(ScanFolderPath((folder.path() + std::string(1000, 'y')).c_str(), ".dwg"), 0);
    std::string problem = "unset";
    EXPECT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg", &problem), 1);
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
    folder.File("short.dwg", 1);
    // A name that brings the full path to 259 characters fits; one more does not.
    const std::size_t room = kMaxPathChars - folder.path().size() - 1;
    ASSERT_GT(room, 10u);
    ASSERT_LT(room, 250u) << "the temporary folder is too short for this test";
    const std::string fits = std::string(room - 4, 'f') + ".dwg";
    const std::string tooLong = std::string(room - 3, 'g') + ".dwg";
    folder.File(fits, 1);
    const std::string longPath = folder.path() + "\\" + tooLong;
    if (!CreateLongFile(longPath))
        GTEST_SKIP() << "the file system does not take a path of " << longPath.size() << " characters";
    std::string problem;
    EXPECT_EQ(ScanFolderPath(folder.path().c_str(), ".dwg", &problem), 1);
    EXPECT_EQ(SortedNames(), (std::vector<std::string>{fits, "short.dwg"}));
    EXPECT_EQ(problem, "1 drawing is not shown: the full path is longer than 259 characters");
    EXPECT_TRUE(DeleteLongFile(longPath));
}

} // namespace
