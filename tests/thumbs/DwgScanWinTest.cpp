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

} // namespace
