// Narrow (ANSI code page) text inside the library, wide text at the host's interface.
#pragma once

#include <string>

std::wstring WidenAnsi(const std::string& text);
std::string NarrowAnsi(const std::wstring& text);
