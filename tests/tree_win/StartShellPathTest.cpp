// The label path the LISP call builds for its start folder must lead the tree to that folder: walked
// the way the tree walks it, on drive C: (Wine's own disk) and drive Z: (the Unix root).
#include "ShellTestSupport.h"
#include "tree/StartShellPath.h"
#include "tests/support/TempFolder.h"

#include <windows.h>

#include <cctype>

namespace {

using treetest::ShellTest;

// The file-system path of the node a label path leads to, or "" when the walk stopped early.
std::string WalkedFolder(const std::string& labelPath, std::string* lastReached = nullptr) {
    const ShellPathWalk walk = WalkShellLabelPath(labelPath);
    std::string path;
    if (!walk.steps.empty() && lastReached)
        ShellFileSystemPath(walk.steps.back().absoluteId.get(), *lastReached);
    if (!walk.complete || walk.steps.empty())
        return "";
    ShellFileSystemPath(walk.steps.back().absoluteId.get(), path);
    return path;
}

::testing::AssertionResult SameFolder(const std::string& a, const std::string& b) {
    if (!a.empty() && lstrcmpiA(a.c_str(), b.c_str()) == 0)
        return ::testing::AssertionSuccess();
    return ::testing::AssertionFailure() << "\"" << a << "\" is not \"" << b << "\"";
}

// A folder a\b inside `base`, checked from its label paths.
void CheckFolderUnder(const std::string& base) {
    const std::string a = base + "\\a";
    const std::string b = a + "\\b";
    CreateDirectoryA(a.c_str(), nullptr);
    CreateDirectoryA(b.c_str(), nullptr);

    const std::string withSlash = StartShellPathOf(b + "\\");
    ASSERT_FALSE(withSlash.empty());
    EXPECT_EQ(withSlash.back(), '\\');
    EXPECT_TRUE(SameFolder(WalkedFolder(withSlash), b)) << withSlash;

    // Without the trailing backslash the last name is taken for a file name: the tree opens its folder.
    const std::string withoutSlash = StartShellPathOf(b);
    EXPECT_TRUE(SameFolder(WalkedFolder(withoutSlash), a)) << withoutSlash;
    EXPECT_TRUE(SameFolder(WalkedFolder(StartShellPathOf(b + "\\drawing.dwg")), b));

    // Letter case does not matter to the walk.
    std::string upper = withSlash;
    CharUpperA(upper.data());
    EXPECT_TRUE(SameFolder(WalkedFolder(upper), b)) << upper;

    // A missing middle folder: the walk opens the folders before it and stops there.
    const std::string missing = StartShellPathOf(a + "\\missing\\b\\");
    std::string reached;
    EXPECT_EQ(WalkedFolder(missing, &reached), "") << missing;
    EXPECT_TRUE(SameFolder(reached, a)) << missing;

    RemoveDirectoryA(b.c_str());
    RemoveDirectoryA(a.c_str());
}

TEST_F(ShellTest, StartPathOnDriveCLeadsToItsFolder) {
    testsupport::TempFolder folder("tree-start");
    ASSERT_TRUE(folder.Dir().size() > 2 && folder.Dir()[1] == ':') << folder.Dir();
    CheckFolderUnder(folder.Dir());
}

TEST_F(ShellTest, StartPathOnDriveZLeadsToItsFolder) {
    // The test runs in its build folder, which Wine shows on drive Z:.
    char current[MAX_PATH] = "";
    GetCurrentDirectoryA(MAX_PATH, current);
    const std::string base = std::string(current) + "\\start-z";
    CreateDirectoryA(base.c_str(), nullptr);
    if (std::toupper(static_cast<unsigned char>(base[0])) != 'Z')
        GTEST_SKIP() << "the build folder is not on drive Z: " << base;
    CheckFolderUnder(base);
    RemoveDirectoryA(base.c_str());
}

TEST_F(ShellTest, TheWalkBeginsAtTheDesktop) {
    const ShellPathWalk nothing = WalkShellLabelPath("");
    EXPECT_TRUE(nothing.complete);
    EXPECT_TRUE(nothing.steps.empty());
    const std::string start = StartShellPathOf("C:\\");
    const std::string desktopLabel = start.substr(0, start.find('\\'));
    const ShellPathWalk desktop = WalkShellLabelPath(desktopLabel);
    ASSERT_EQ(desktop.steps.size(), 1u);
    EXPECT_TRUE(desktop.complete);
    EXPECT_EQ(ItemIdListSize(desktop.steps[0].absoluteId.get()), 0u);
    const ShellPathWalk wrong = WalkShellLabelPath("No such place\\x");
    EXPECT_FALSE(wrong.complete);
    EXPECT_TRUE(wrong.steps.empty());
}

} // namespace
