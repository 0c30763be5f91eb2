#include "devhost/HostPrintf.h"

#include <cwchar>

namespace devhost {
namespace {

// The conversion starting after the '%' at `p` is one of ours; `length` is its length in characters.
bool Supported(const wchar_t* p, std::size_t& length) {
    if (p[0] == L'%' || p[0] == L'd') {
        length = 1;
        return true;
    }
    if (p[0] == L'l' && p[1] == L's') {
        length = 2;
        return true;
    }
    return false;
}

bool AllSupported(const wchar_t* format) {
    for (const wchar_t* p = format; *p; ++p) {
        if (*p != L'%')
            continue;
        std::size_t length = 0;
        if (!Supported(p + 1, length))
            return false;
        p += length;
    }
    return true;
}

} // namespace

std::wstring FormatHostText(const wchar_t* format, va_list argsIn) {
    if (!format)
        return std::wstring();
    if (!AllSupported(format))
        return kRefusedFormat + std::wstring(format);
    va_list args;
    va_copy(args, argsIn);
    std::wstring out;
    for (const wchar_t* p = format; *p; ++p) {
        if (*p != L'%') {
            out += *p;
            continue;
        }
        ++p;
        if (*p == L'%') {
            out += L'%';
        } else if (*p == L'd') {
            out += std::to_wstring(va_arg(args, int));
        } else { // l s
            ++p;
            const wchar_t* text = va_arg(args, const wchar_t*);
            out += text ? text : L"(null)";
        }
    }
    va_end(args);
    return out;
}

} // namespace devhost
