// The settings' messages in the Japanese locale (the tests run again with Wine there): the settings file's
// bound is in bytes, and a text of double-byte characters is told its length in characters and in bytes.
#include "settings/FolderSettings.h"
#include "settings/IniFile.h"

#include <gtest/gtest.h>

#include <string>

#include <windows.h>

namespace {

TEST(FolderSettingsAccept, TooLongJapaneseTextIsToldInCharactersAndBytes) {
    if (::GetACP() != 932)
        GTEST_SKIP() << "runs in code page 932, this is " << ::GetACP();
    std::string command = "(c:";
    for (int i = 0; i < 1100; ++i)
        command += "\x83\x5C"; // katakana so
    command += ")";
    EXPECT_EQ(CommandTooLongAlert(command),
              "The LISP command is 1104 characters, 2204 bytes long; the folder's "
              "settings hold at most 2034 bytes. Shorten it, then Accept again.");
    std::string layer;
    for (int i = 0; i < 1030; ++i)
        layer += "\x82\xA0"; // hiragana a
    EXPECT_EQ(LayerTooLongAlert(layer),
              "The layer name is 1030 characters, 2060 bytes long; the folder's settings "
              "hold at most " +
                  std::to_string(MaxFolderLayerChars()) + " bytes. Shorten it, then Accept again.");
    EXPECT_EQ(
        WhyIniValueUnreadable("Lisp command", command),
        "the value of Lisp command is 1104 characters, 2204 bytes long, at most 2034 bytes can be read back");
}

} // namespace
