// acutPrintf's formatting, as far as the library and devhost's tests use it. Portable.
//  - %ls takes a wide string (a null pointer prints (null)), %d an int, %% prints %.
//  - A format with any other conversion (or flags, width, precision, a length other than the l of %ls)
//    is not formatted: the call prints kRefusedFormat followed by the format exactly as it is, and reads
//    none of the arguments. A new kind of call then shows at once in the end-to-end output instead of
//    being formatted by rules nobody checked against the CAD application's own printf.
#pragma once

#include <cstdarg>
#include <string>

namespace devhost {

inline constexpr wchar_t kRefusedFormat[] = L"[printf refused] ";

std::wstring FormatHostText(const wchar_t* format, va_list args);

} // namespace devhost
