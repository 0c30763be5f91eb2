// acutPrintf's formatting. Portable, so that one set of rules holds on every platform:
// the Windows wide-printf semantics that the host's callers are written against.
//  - %s and %ls take a wide string, %hs and %S a narrow one (bytes taken as Latin-1, or through the
//    converter set with SetNarrowConverter); a null pointer prints (null).
//  - %c and %lc take a wide character, %hc and %C a narrow one.
//  - integers: d i u o x X with the length prefixes hh h l ll z j t I I32 I64; reals: f F e E g G a A;
//    %p; %%; flags - + space # 0, width and precision, also as *.
//  - %n writes nothing and consumes its pointer; an unknown conversion is printed as written.
#pragma once

#include <cstdarg>
#include <string>

namespace devhost {

std::wstring FormatHostText(const wchar_t* format, va_list args);

// How narrow text given to %hs is turned into wide text (the default treats bytes as Latin-1).
using NarrowConverter = std::wstring (*)(const char* text);
void SetNarrowConverter(NarrowConverter converter);

} // namespace devhost
