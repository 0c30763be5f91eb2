// Native builds stand in for the ANSI code page with Latin-1: one byte, one character.
#include "hostapi/TextConv.h"

std::wstring WidenAnsi(const std::string& text) {
    std::wstring wide;
    wide.reserve(text.size());
    for (unsigned char c : text)
        wide.push_back(static_cast<wchar_t>(c));
    return wide;
}

std::string NarrowAnsi(const std::wstring& text) {
    std::string narrow;
    narrow.reserve(text.size());
    for (wchar_t c : text)
        narrow.push_back(static_cast<unsigned>(c) < 256 ? static_cast<char>(c) : '?');
    return narrow;
}
