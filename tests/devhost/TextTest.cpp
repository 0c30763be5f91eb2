#include "devhost/Text.h"

#include <gtest/gtest.h>

namespace {

TEST(Text, Utf8BothWays) {
    const std::wstring text = L"a\xe9\x20ac";
    EXPECT_EQ(devhost::ToUtf8(text), "a\xc3\xa9\xe2\x82\xac");
    EXPECT_EQ(devhost::FromUtf8("a\xc3\xa9\xe2\x82\xac"), text);
    EXPECT_EQ(devhost::ToUtf8(devhost::FromUtf8("\xf0\x9f\x98\x80")), "\xf0\x9f\x98\x80");
}

TEST(Text, BrokenUtf8BecomesReplacement) {
    EXPECT_EQ(devhost::FromUtf8("\xff"), L"\xfffd");
    EXPECT_EQ(devhost::FromUtf8("\xc3"), L"\xfffd");
    EXPECT_EQ(devhost::FromUtf8("\xc0\x80"), L"\xfffd\xfffd");
}

TEST(Text, ControlsAreWrittenCStyle) {
    EXPECT_EQ(devhost::EscapeControls(L"\nMissing\tparametrs\r\\\x01\x7f"),
              L"\\nMissing\\tparametrs\\r\\\\\\x01\\x7f");
    EXPECT_EQ(devhost::EscapeControls(L"plain"), L"plain");
}

} // namespace
