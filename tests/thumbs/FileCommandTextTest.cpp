#include "thumbs/FileCommandText.h"

#include <gtest/gtest.h>

TEST(FileCommandText, AFileGoneIsNamed) {
    FileCommandFailure why;
    why.missing = "a.dwg";
    why.error = 2;
    EXPECT_EQ(FileCommandFailureText(FileCommand::Rename, "a.dwg", why),
              "Cannot rename \"a.dwg\": a.dwg no longer exists. The folder is shown as it is now.");
}

TEST(FileCommandText, AReadOnlyFolderIsSaid) {
    FileCommandFailure why;
    why.readOnly = true;
    why.error = 5;
    EXPECT_EQ(FileCommandFailureText(FileCommand::Paste, "C:\\dwg", why),
              "Cannot paste into \"C:\\dwg\": the folder is read-only. The folder is shown as it is now.");
    EXPECT_EQ(FileCommandFailureText(FileCommand::Delete, "3 drawings", why),
              "Cannot delete 3 drawings: the folder is read-only. The folder is shown as it is now.");
}

TEST(FileCommandText, OtherwiseTheSystemsErrorIsGiven) {
    FileCommandFailure why;
    why.error = 1234;
    EXPECT_EQ(
        FileCommandFailureText(FileCommand::Rename, "a.dwg", why),
        "Cannot rename \"a.dwg\": the system refused it (error 1234). The folder is shown as it is now.");
}
