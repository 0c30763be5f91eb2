// Item id lists, display-name text, labels, child indicators, file-system paths and the order of a
// folder's sub-folders, against Wine's shell.
#include "ShellTestSupport.h"
#include "tests/support/TempFolder.h"
#include "hostapi/TextConv.h"
#include "tree/ShellString.h"

#include <cstring>

namespace {

using treetest::PidlOfPath;
using treetest::ShellTest;

TEST_F(ShellTest, PidlCopyAndConcatKeepTheBytesAndTheTerminator) {
    testsupport::TempFolder folder("tree-pidl");
    folder.MakeDir("sub");
    const CShellPidl parent = PidlOfPath(folder.Dir());
    const CShellPidl child = PidlOfPath(folder.Dir() + "\\sub");
    ASSERT_TRUE(parent);
    ASSERT_TRUE(child);
    const std::size_t parentSize = ItemIdListSize(parent.get());
    EXPECT_EQ(ItemIdListSize(child.get()), parentSize + ItemIdListSize(LastItemId(child.get())));

    const CShellPidl copy = CShellPidl::CopyOf(child.get());
    ASSERT_TRUE(copy);
    EXPECT_NE(copy.get(), child.get());
    EXPECT_EQ(std::memcmp(copy.get(), child.get(), ItemIdListSize(child.get()) + 2), 0);

    const CShellPidl joined = CShellPidl::Concat(parent.get(), LastItemId(child.get()));
    ASSERT_TRUE(joined);
    EXPECT_EQ(ItemIdListSize(joined.get()), ItemIdListSize(child.get()));
    EXPECT_EQ(std::memcmp(joined.get(), child.get(), ItemIdListSize(child.get()) + 2), 0);

    const CShellPidl empty = CShellPidl::Concat(nullptr, nullptr);
    ASSERT_TRUE(empty);
    EXPECT_EQ(ItemIdListSize(empty.get()), 0u);
    EXPECT_EQ(LastItemId(empty.get()), empty.get());
    EXPECT_FALSE(CShellPidl::CopyOf(nullptr));
}

TEST_F(ShellTest, PidlMovesOwnership) {
    CShellPidl first = CShellPidl::Concat(nullptr, nullptr);
    LPITEMIDLIST raw = first.get();
    CShellPidl second(std::move(first));
    EXPECT_FALSE(first);
    EXPECT_EQ(second.get(), raw);
    CShellPidl third;
    third = std::move(second);
    EXPECT_EQ(third.get(), raw);
    third.Reset();
    EXPECT_FALSE(third);
}

TEST_F(ShellTest, ShellStringReadsEveryKind) {
    STRRET inline_{};
    inline_.uType = STRRET_CSTR;
    std::strcpy(inline_.cStr, "inline");
    EXPECT_EQ(CShellString(inline_, nullptr).Text(), "inline");

    // An id whose bytes carry a name: offset 2 skips the size field.
    const BYTE id[] = {10, 0, 'n', 'a', 'm', 'e', 0, 0, 0, 0, 0, 0};
    STRRET offset{};
    offset.uType = STRRET_OFFSET;
    offset.uOffset = 2;
    EXPECT_EQ(CShellString(offset, reinterpret_cast<LPCITEMIDLIST>(id)).Text(), "name");
    offset.uOffset = 40; // outside the id
    EXPECT_EQ(CShellString(offset, reinterpret_cast<LPCITEMIDLIST>(id)).Text(), "");

    STRRET wide{};
    wide.uType = STRRET_WSTR;
    wide.pOleStr = static_cast<LPWSTR>(CoTaskMemAlloc(6 * sizeof(wchar_t)));
    ASSERT_NE(wide.pOleStr, nullptr);
    std::wcscpy(wide.pOleStr, L"wide!");
    EXPECT_EQ(CShellString(wide, nullptr).Text(), "wide!"); // and the text is freed with it
}

TEST_F(ShellTest, FileSystemPathRefusesWhatDoesNotFit) {
    testsupport::TempFolder folder("tree-path");
    const CShellPidl pidl = PidlOfPath(folder.Dir());
    ASSERT_TRUE(pidl);
    std::string path;
    ASSERT_TRUE(ShellFileSystemPath(pidl.get(), path));
    EXPECT_EQ(lstrcmpiA(path.c_str(), folder.Dir().c_str()), 0) << path;
    EXPECT_TRUE(ShellFileSystemPath(pidl.get(), path, path.size() + 1));
    EXPECT_FALSE(ShellFileSystemPath(pidl.get(), path, path.size()));
    EXPECT_EQ(path, "");

    CShellPidl desktopId;
    ASSERT_EQ(SHGetSpecialFolderLocation(nullptr, CSIDL_DRIVES, desktopId.Receive()), S_OK);
    EXPECT_FALSE(ShellFileSystemPath(desktopId.get(), path)); // a virtual folder has none
}

TEST_F(ShellTest, FileSystemPathOfAFolderLongerThanTheRuntimesLimitIsWhole) {
    // A folder whose path is longer than MAX_PATH, reached as the tree reaches it: its parent's children.
    testsupport::TempFolder folder("tree-long");
    const std::string segment(60, 'd');
    std::string parentPath = folder.Dir();
    for (int i = 0; i < 3; ++i) {
        parentPath += "\\" + segment;
        ASSERT_TRUE(::CreateDirectoryA(parentPath.c_str(), nullptr)) << parentPath;
    }
    const std::string childName(60, 'e');
    const std::string childPath = parentPath + "\\" + childName;
    ASSERT_GT(childPath.size(), static_cast<std::size_t>(MAX_PATH));
    ASSERT_TRUE(::CreateDirectoryW((L"\\\\?\\" + WidenAnsi(childPath)).c_str(), nullptr));
    CDesktopFolderRef desktop;
    ASSERT_TRUE(desktop);
    const CShellPidl parentId = PidlOfPath(parentPath);
    ASSERT_TRUE(parentId);
    IShellFolder* parent = BindShellFolder(desktop.get(), parentId.get());
    ASSERT_NE(parent, nullptr);
    IEnumIDList* children = nullptr;
    ASSERT_EQ(parent->EnumObjects(nullptr, SHCONTF_FOLDERS, &children), S_OK);
    LPITEMIDLIST child = nullptr;
    ASSERT_EQ(children->Next(1, &child, nullptr), S_OK);
    const CShellPidl relative(child);
    const CShellPidl childId = CShellPidl::Concat(parentId.get(), relative.get());
    children->Release();
    parent->Release();
    std::string path;
    ASSERT_TRUE(ShellFileSystemPath(childId.get(), path, kLongestPathChars + 1));
    EXPECT_EQ(lstrcmpiA(path.c_str(), childPath.c_str()), 0) << path;
    // Too long for the runtime's buffers: not given where those are meant.
    EXPECT_FALSE(ShellFileSystemPath(childId.get(), path));
    ::RemoveDirectoryW((L"\\\\?\\" + WidenAnsi(childPath)).c_str());
}

TEST_F(ShellTest, LabelsAndChildIndicators) {
    testsupport::TempFolder folder("tree-label");
    folder.MakeDir("full");
    folder.MakeDir("full\\inner");
    folder.MakeDir("empty");
    CDesktopFolderRef desktop;
    ASSERT_TRUE(desktop);
    const CShellPidl folderId = PidlOfPath(folder.Dir());
    IShellFolder* parent = BindShellFolder(desktop.get(), folderId.get());
    ASSERT_NE(parent, nullptr);
    const CShellPidl full = PidlOfPath(folder.Dir() + "\\full");
    const CShellPidl empty = PidlOfPath(folder.Dir() + "\\empty");

    EXPECT_EQ(ShellLabelOf(parent, full.get(), 0), "full");
    // The file-system label keeps the rightmost n characters, n = position of the last backslash.
    std::string path;
    ASSERT_TRUE(ShellFileSystemPath(full.get(), path));
    const std::size_t n = path.find_last_of('\\');
    EXPECT_EQ(ShellLabelOf(parent, full.get(), kShellFileSystemName), path.substr(path.size() - n));
    EXPECT_EQ(ShellLabelOf(parent, full.get(), kShellFileSystemName | kShellNormalName), path);

    EXPECT_TRUE(ShellHasChildren(parent, LastItemId(full.get()), 0));
    // Wine's shell says every file-system folder has sub-folders, so only files show no button here.
    EXPECT_TRUE(ShellHasChildren(parent, LastItemId(empty.get()), kShellNonFolders));
    folder.Write("file.txt", "x");
    const CShellPidl file = PidlOfPath(folder.Dir() + "\\file.txt");
    ASSERT_TRUE(file);
    EXPECT_FALSE(ShellHasChildren(parent, LastItemId(file.get()), 0));
    EXPECT_FALSE(ShellHasChildren(parent, LastItemId(file.get()), kShellNonFolders));
    parent->Release();
}

TEST_F(ShellTest, SubFoldersComeInTheFoldersOrderWithoutFilesOrHiddenOnes) {
    testsupport::TempFolder folder("tree-enum");
    folder.MakeDir("b");
    folder.MakeDir("a");
    folder.MakeDir("C");
    const std::string hidden = folder.MakeDir("h");
    SetFileAttributesA(hidden.c_str(), FILE_ATTRIBUTE_HIDDEN);
    folder.Write("file.dwg", "x");
    CDesktopFolderRef desktop;
    const CShellPidl folderId = PidlOfPath(folder.Dir());
    IShellFolder* shellFolder = BindShellFolder(desktop.get(), folderId.get());
    ASSERT_NE(shellFolder, nullptr);

    auto labels = [&](std::uint32_t flags) {
        std::string joined;
        for (const CShellPidl& child : EnumerateShellChildren(shellFolder, nullptr, flags)) {
            const CShellPidl absolute = CShellPidl::Concat(folderId.get(), child.get());
            joined += ShellLabelOf(shellFolder, absolute.get(), 0) + ";";
        }
        return joined;
    };
    EXPECT_EQ(labels(0), "a;b;C;");
    EXPECT_EQ(labels(kShellHidden), "a;b;C;h;");
    EXPECT_EQ(labels(kShellNonFolders), "a;b;C;file.dwg;");
    shellFolder->Release();
}

TEST_F(ShellTest, TheDesktopBindsToItself) {
    CDesktopFolderRef desktop;
    const CShellPidl empty = CShellPidl::Concat(nullptr, nullptr);
    IShellFolder* folder = BindShellFolder(desktop.get(), empty.get());
    EXPECT_EQ(folder, desktop.get());
    if (folder)
        folder->Release();
    CDesktopFolderRef second;
    EXPECT_EQ(second.get(), desktop.get()); // one desktop folder for the process
}

} // namespace
