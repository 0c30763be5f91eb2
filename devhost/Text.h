// Text helpers of the host's command line. Portable.
#pragma once

#include <string>
#include <string_view>

namespace devhost {

// UTF-8 of wide text (UTF-16 where wchar_t has 16 bits, UTF-32 elsewhere); broken surrogates become U+FFFD.
std::string ToUtf8(std::wstring_view text);

// Wide text of UTF-8 bytes; invalid sequences become U+FFFD.
std::wstring FromUtf8(std::string_view text);

// Control characters written C-style, as on one line: \n \r \t \\ stay readable, the rest as \xHH.
std::wstring EscapeControls(std::wstring_view text);

} // namespace devhost
