#include "thumbs/RenameRules.h"

#include <gtest/gtest.h>

#include <set>
#include <string>

namespace {

const std::string kFolder = "C:\\Drawings\\";

RenameVerdict Check(const std::string& newName, const std::set<std::string>& existing = {}) {
    return CheckRename(kFolder, "plan.dwg", newName,
                       [&existing](const std::string& name) { return existing.count(name) != 0; });
}

TEST(RenameRules, APlainDrawingNameIsRenamed) {
    EXPECT_EQ(Check("plan-b.dwg"), RenameVerdict::Rename);
    EXPECT_EQ(Check("New Plan 2.DWG"), RenameVerdict::Rename);
    EXPECT_EQ(Check("\xE9tage.dwg"), RenameVerdict::Rename);
    EXPECT_EQ(Check("contents.dwg"), RenameVerdict::Rename); // only a whole first part is a device
}

TEST(RenameRules, TheSameNameIsNoRename) {
    EXPECT_EQ(Check("plan.dwg"), RenameVerdict::Unchanged);
    EXPECT_EQ(RenameRefusalText(RenameVerdict::Unchanged, "plan.dwg"), "");
}

TEST(RenameRules, AChangeOfLetterCaseAloneIsARenameEvenThoughTheFileAnswersToTheName) {
    // A case-insensitive file system finds the file itself under the new name.
    EXPECT_EQ(Check("PLAN.DWG", {"PLAN.DWG", "plan.dwg"}), RenameVerdict::Rename);
    EXPECT_EQ(Check("Plan.dwg", {"Plan.dwg"}), RenameVerdict::Rename);
    EXPECT_EQ(Check("PLAN.DWG.DWG", {"PLAN.DWG.DWG"}), RenameVerdict::Exists);
}

TEST(RenameRules, ForbiddenCharactersAreRefused) {
    for (const char* bad : {"a\\b.dwg", "a/b.dwg", "c:b.dwg", "a*.dwg", "a?.dwg", "a\"b.dwg", "a<b.dwg",
                            "a>b.dwg", "a|b.dwg", "a\tb.dwg", "a\nb.dwg", "a\x01.dwg", "a\x7F.dwg"})
        EXPECT_EQ(Check(bad), RenameVerdict::BadCharacter) << bad;
    EXPECT_EQ(
        RenameRefusalText(RenameVerdict::BadCharacter, "a*.dwg"),
        "Cannot rename to \"a*.dwg\": a name cannot contain \\ / : * ? \" < > | or control characters.");
}

TEST(RenameRules, ANameMustEndInTheDrawingExtension) {
    for (const char* bad : {"plan", "plan.dw", "plan.dwgx", "plan.dwg.bak", "dwg", "plan.dwg ", "plan.dwg."})
        EXPECT_EQ(Check(bad), RenameVerdict::NotDrawing) << bad;
    EXPECT_EQ(RenameRefusalText(RenameVerdict::NotDrawing, "plan.txt"),
              "Cannot rename to \"plan.txt\": a drawing's name ends in .dwg.");
}

TEST(RenameRules, DeviceNamesAreRefused) {
    for (const char* bad : {"con.dwg", "CON.dwg", "nul.dwg", "aux.dwg", "prn.dwg", "com1.dwg", "LPT9.dwg",
                            "con .dwg", "nul.x.dwg", "con.tents.dwg"})
        EXPECT_EQ(Check(bad), RenameVerdict::DeviceName) << bad;
    EXPECT_EQ(Check("com0.dwg"), RenameVerdict::Rename);
    EXPECT_EQ(Check("console.dwg"), RenameVerdict::Rename);
}

TEST(RenameRules, AnExistingNameIsRefused) {
    EXPECT_EQ(Check("other.dwg", {"other.dwg"}), RenameVerdict::Exists);
    EXPECT_EQ(RenameRefusalText(RenameVerdict::Exists, "other.dwg"),
              "Cannot rename to \"other.dwg\": a file of that name already exists.");
    // The file system is asked only about names that pass every other rule.
    int asked = 0;
    CheckRename(kFolder, "plan.dwg", "a*.dwg", [&asked](const std::string&) { return ++asked, true; });
    EXPECT_EQ(asked, 0);
}

TEST(RenameRules, TheExtensionAloneIsAnEmptyName) {
    EXPECT_EQ(Check(".dwg"), RenameVerdict::Empty);
    EXPECT_EQ(Check(".DWG"), RenameVerdict::Empty);
    EXPECT_EQ(RenameRefusalText(RenameVerdict::Empty, ".dwg"),
              "Cannot rename to \".dwg\": the name before .dwg is empty.");
    EXPECT_EQ(Check("a.dwg"), RenameVerdict::Rename);
}

TEST(RenameRules, EmptyAndTooLongNamesAreRefused) {
    EXPECT_EQ(Check(""), RenameVerdict::Empty);
    EXPECT_NE(RenameRefusalText(RenameVerdict::Empty, ""), "");
    // "C:\Drawings\" is 12 characters: 247 more make 259.
    EXPECT_EQ(Check(std::string(243, 'n') + ".dwg"), RenameVerdict::Rename);
    EXPECT_EQ(Check(std::string(244, 'n') + ".dwg"), RenameVerdict::TooLong);
    EXPECT_EQ(CheckRename("C:\\", "a.dwg", std::string(252, 'n') + ".dwg", nullptr), RenameVerdict::TooLong);
    EXPECT_EQ(RenameRefusalText(RenameVerdict::TooLong, "x.dwg"),
              "Cannot rename to \"x.dwg\": the full path would be longer than 259 characters.");
}

} // namespace
