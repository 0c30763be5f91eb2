#include "devhost/HostPrintf.h"

#include <gtest/gtest.h>

#include <cstdint>

namespace {

std::wstring Format(const wchar_t* format, ...) {
    va_list args;
    va_start(args, format);
    std::wstring text = devhost::FormatHostText(format, args);
    va_end(args);
    return text;
}

TEST(HostPrintf, PlainTextPassesThrough) {
    EXPECT_EQ(Format(L"\nMissing parametrs\n"), L"\nMissing parametrs\n");
    EXPECT_EQ(Format(L"100%%"), L"100%");
    EXPECT_EQ(Format(nullptr), L"");
}

TEST(HostPrintf, PercentSIsWide) {
    EXPECT_EQ(Format(L"[%s]", L"wide"), L"[wide]");
    EXPECT_EQ(Format(L"[%ls]", L"wide"), L"[wide]");
    EXPECT_EQ(Format(L"[%hs]", "narrow"), L"[narrow]");
    EXPECT_EQ(Format(L"[%S]", "narrow"), L"[narrow]");
    EXPECT_EQ(Format(L"[%s]", static_cast<const wchar_t*>(nullptr)), L"[(null)]");
    EXPECT_EQ(Format(L"[%hs]", "\xe9"), L"[\xe9]");
}

TEST(HostPrintf, WidthPrecisionAndFlags) {
    EXPECT_EQ(Format(L"[%5s|%-5s|%.2s]", L"ab", L"ab", L"abcdef"), L"[   ab|ab   |ab]");
    EXPECT_EQ(Format(L"[%*d|%-*d|%.*f]", 4, 7, 3, 7, 2, 3.14159), L"[   7|7  |3.14]");
    EXPECT_EQ(Format(L"[%05d|%+d|% d|%x|%X|%#o]", 42, 5, 5, 255, 255, 8), L"[00042|+5| 5|ff|FF|010]");
    EXPECT_EQ(Format(L"[%c%lc%hc]", L'W', L'x', 'n'), L"[Wxn]");
}

TEST(HostPrintf, IntegerSizes) {
    EXPECT_EQ(Format(L"%d %i %u", -1, 2, 3u), L"-1 2 3");
    EXPECT_EQ(Format(L"%hd %hhd", 70000, 300), L"4464 44");
    EXPECT_EQ(
        Format(L"%ld %lld %I64d %zu", 5L, -6LL, static_cast<long long>(1) << 40, static_cast<std::size_t>(9)),
        L"5 -6 1099511627776 9");
}

TEST(HostPrintf, Reals) {
    EXPECT_EQ(Format(L"%f %.1f %e %g", 1.5, 2.26, 1000.0, 0.0001), L"1.500000 2.3 1.000000e+03 0.0001");
}

TEST(HostPrintf, UnknownConversionIsKept) {
    EXPECT_EQ(Format(L"a %y b"), L"a %y b");
    EXPECT_EQ(Format(L"end %"), L"end %");
}

TEST(HostPrintf, NarrowConverterIsUsed) {
    devhost::SetNarrowConverter([](const char*) { return std::wstring(L"converted"); });
    EXPECT_EQ(Format(L"%hs", "x"), L"converted");
    devhost::SetNarrowConverter(nullptr);
    EXPECT_EQ(Format(L"%hs", "x"), L"x");
}

} // namespace
