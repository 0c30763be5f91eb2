#include "devhost/HostPrintf.h"

#include <gtest/gtest.h>

#include <climits>

namespace {

std::wstring Format(const wchar_t* format, ...) {
    va_list args;
    va_start(args, format);
    std::wstring text = devhost::FormatHostText(format, args);
    va_end(args);
    return text;
}

std::wstring Refused(const wchar_t* format) {
    return devhost::kRefusedFormat + std::wstring(format);
}

TEST(HostPrintf, PlainTextPassesThrough) {
    EXPECT_EQ(Format(L"\nMissing parametrs\n"), L"\nMissing parametrs\n");
    EXPECT_EQ(Format(L"100%%"), L"100%");
    EXPECT_EQ(Format(L""), L"");
    EXPECT_EQ(Format(nullptr), L"");
}

TEST(HostPrintf, PercentLsIsAWideString) {
    EXPECT_EQ(Format(L"%ls", L"\nArgument should be an short\n"), L"\nArgument should be an short\n");
    EXPECT_EQ(Format(L"[%ls|%ls]", L"wide", L""), L"[wide|]");
    EXPECT_EQ(Format(L"[%ls]", static_cast<const wchar_t*>(nullptr)), L"[(null)]");
    EXPECT_EQ(Format(L"%ls", L"100%% as it is"), L"100%% as it is"); // arguments are not formats
}

TEST(HostPrintf, PercentDIsAnInt) {
    EXPECT_EQ(Format(L"%d %d %d", 0, -1, 42), L"0 -1 42");
    EXPECT_EQ(Format(L"%d|%d", INT_MIN, INT_MAX), L"-2147483648|2147483647");
}

TEST(HostPrintf, TheLibrarysLongestMessage) {
    EXPECT_EQ(Format(L"\nOrvex: the %ls is too long (%d characters; at most %d)\n", L"start path", 300, 259),
              L"\nOrvex: the start path is too long (300 characters; at most 259)\n");
}

TEST(HostPrintf, AnyOtherConversionPrintsTheFormatAsItIsAndReadsNoArgument) {
    // No arguments are passed: reading one would be undefined, so these also show that none is read.
    for (const wchar_t* format : {L"%s", L"%S", L"%hs", L"%c", L"%u", L"%x", L"%f", L"%.2f", L"%p", L"%n",
                                  L"%5d", L"%-d", L"%ld", L"%lld", L"%I64d", L"%*d", L"%l", L"%y", L"end %"}) {
        EXPECT_EQ(Format(format), Refused(format)) << format;
    }
}

TEST(HostPrintf, OneRefusedConversionRefusesTheWholeFormat) {
    EXPECT_EQ(Format(L"\nhello %ls %d %.2f\n"), Refused(L"\nhello %ls %d %.2f\n"));
    EXPECT_EQ(Format(L"%d%%%s"), Refused(L"%d%%%s"));
}

} // namespace
