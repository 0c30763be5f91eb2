#include "devhost/HostPrintf.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <cwchar>
#include <vector>

namespace devhost {
namespace {

std::wstring Latin1(const char* text) {
    std::wstring out;
    for (; *text; ++text)
        out += static_cast<wchar_t>(static_cast<unsigned char>(*text));
    return out;
}

NarrowConverter g_narrowConverter = &Latin1;

enum class Length { None, Char, Short, Long, LongLong, Size, Max, PtrDiff, LongDouble, Int64, Int32 };

// Formats with the C library's narrow snprintf: `spec` holds flags, width and precision only (no *).
std::wstring Narrow(const std::string& spec, const char* conversion, ...) {
    std::string format = "%" + spec + conversion;
    va_list args;
    va_start(args, conversion);
    va_list again;
    va_copy(again, args);
    char small[128];
    const int length = std::vsnprintf(small, sizeof small, format.c_str(), args);
    va_end(args);
    std::wstring out;
    if (length < 0) {
        va_end(again);
        return out;
    }
    if (static_cast<std::size_t>(length) < sizeof small) {
        out.assign(small, small + length);
    } else {
        std::vector<char> big(static_cast<std::size_t>(length) + 1);
        std::vsnprintf(big.data(), big.size(), format.c_str(), again);
        out.assign(big.data(), big.data() + length);
    }
    va_end(again);
    return out;
}

// Pads text to the width, on the left unless the '-' flag is given.
std::wstring Pad(std::wstring text, int width, bool left) {
    if (width > 0 && text.size() < static_cast<std::size_t>(width)) {
        const std::wstring fill(static_cast<std::size_t>(width) - text.size(), L' ');
        text = left ? text + fill : fill + text;
    }
    return text;
}

} // namespace

void SetNarrowConverter(NarrowConverter converter) {
    g_narrowConverter = converter ? converter : &Latin1;
}

std::wstring FormatHostText(const wchar_t* format, va_list argsIn) {
    std::wstring out;
    if (!format)
        return out;
    va_list args;
    va_copy(args, argsIn);
    for (const wchar_t* p = format; *p;) {
        if (*p != L'%') {
            out += *p++;
            continue;
        }
        const wchar_t* start = p++;
        std::string flags;
        while (*p && std::wcschr(L"-+ #0", *p))
            flags += static_cast<char>(*p++);
        const bool left = flags.find('-') != std::string::npos;
        int width = -1;
        bool leftFromStar = false;
        if (*p == L'*') {
            width = va_arg(args, int);
            if (width < 0) {
                leftFromStar = true;
                width = -width;
            }
            ++p;
        } else if (*p >= L'0' && *p <= L'9') {
            width = 0;
            while (*p >= L'0' && *p <= L'9' && width < 100000)
                width = width * 10 + (*p++ - L'0');
            while (*p >= L'0' && *p <= L'9')
                ++p;
        }
        int precision = -1;
        if (*p == L'.') {
            ++p;
            precision = 0;
            if (*p == L'*') {
                precision = va_arg(args, int);
                ++p;
            } else {
                while (*p >= L'0' && *p <= L'9' && precision < 100000)
                    precision = precision * 10 + (*p++ - L'0');
                while (*p >= L'0' && *p <= L'9')
                    ++p;
            }
        }
        Length length = Length::None;
        if (*p == L'h') {
            ++p;
            length = Length::Short;
            if (*p == L'h') {
                ++p;
                length = Length::Char;
            }
        } else if (*p == L'l') {
            ++p;
            length = Length::Long;
            if (*p == L'l') {
                ++p;
                length = Length::LongLong;
            }
        } else if (*p == L'z') {
            ++p;
            length = Length::Size;
        } else if (*p == L'j') {
            ++p;
            length = Length::Max;
        } else if (*p == L't') {
            ++p;
            length = Length::PtrDiff;
        } else if (*p == L'L') {
            ++p;
            length = Length::LongDouble;
        } else if (*p == L'I') {
            if (p[1] == L'6' && p[2] == L'4') {
                p += 3;
                length = Length::Int64;
            } else if (p[1] == L'3' && p[2] == L'2') {
                p += 3;
                length = Length::Int32;
            } else {
                ++p;
                length = Length::Size;
            }
        }
        const wchar_t conversion = *p;
        if (!conversion) { // a lone % at the end: print what was written
            out.append(start, p);
            break;
        }
        ++p;
        // Flags, width and precision for the C library, star values resolved.
        std::string spec = flags;
        if (leftFromStar && !left)
            spec += '-';
        if (width >= 0)
            spec += std::to_string(width);
        if (precision >= 0)
            spec += "." + std::to_string(precision);
        const bool padLeft = left || leftFromStar;

        switch (conversion) {
        case L'%':
            out += L'%';
            break;
        case L'd':
        case L'i': {
            long long value;
            switch (length) {
            case Length::Char:
                value = static_cast<signed char>(va_arg(args, int));
                break;
            case Length::Short:
                value = static_cast<short>(va_arg(args, int));
                break;
            case Length::Long:
                value = va_arg(args, long);
                break;
            case Length::LongLong:
            case Length::Int64:
            case Length::Max:
                value = va_arg(args, long long);
                break;
            case Length::Size:
            case Length::PtrDiff:
                value = static_cast<long long>(va_arg(args, std::ptrdiff_t));
                break;
            default:
                value = va_arg(args, int);
            }
            out += Narrow(spec, "lld", value);
            break;
        }
        case L'u':
        case L'o':
        case L'x':
        case L'X': {
            unsigned long long value;
            switch (length) {
            case Length::Char:
                value = static_cast<unsigned char>(va_arg(args, unsigned));
                break;
            case Length::Short:
                value = static_cast<unsigned short>(va_arg(args, unsigned));
                break;
            case Length::Long:
                value = va_arg(args, unsigned long);
                break;
            case Length::LongLong:
            case Length::Int64:
            case Length::Max:
                value = va_arg(args, unsigned long long);
                break;
            case Length::Size:
            case Length::PtrDiff:
                value = va_arg(args, std::size_t);
                break;
            default:
                value = va_arg(args, unsigned);
            }
            const char* c = conversion == L'u'   ? "llu"
                            : conversion == L'o' ? "llo"
                            : conversion == L'x' ? "llx"
                                                 : "llX";
            out += Narrow(spec, c, value);
            break;
        }
        case L'f':
        case L'F':
        case L'e':
        case L'E':
        case L'g':
        case L'G':
        case L'a':
        case L'A': {
            const double value = length == Length::LongDouble ? static_cast<double>(va_arg(args, long double))
                                                              : va_arg(args, double);
            const char c[2] = {static_cast<char>(conversion), 0};
            out += Narrow(spec, c, value);
            break;
        }
        case L'p': {
            const void* value = va_arg(args, void*);
            char buffer[32];
            std::snprintf(buffer, sizeof buffer, "%016llX",
                          static_cast<unsigned long long>(reinterpret_cast<std::uintptr_t>(value)));
            out += Pad(std::wstring(buffer, buffer + std::strlen(buffer)), width, padLeft);
            break;
        }
        case L'c':
        case L'C': {
            const bool narrow = length == Length::Short || (conversion == L'C' && length != Length::Long);
            const int value = va_arg(args, int);
            const wchar_t c = narrow ? static_cast<wchar_t>(static_cast<unsigned char>(value))
                                     : static_cast<wchar_t>(value);
            out += Pad(std::wstring(1, c), width, padLeft);
            break;
        }
        case L's':
        case L'S': {
            const bool narrow = length == Length::Short || (conversion == L'S' && length != Length::Long);
            std::wstring text;
            if (narrow) {
                const char* value = va_arg(args, const char*);
                text = value ? g_narrowConverter(value) : std::wstring(L"(null)");
            } else {
                const wchar_t* value = va_arg(args, const wchar_t*);
                text = value ? std::wstring(value) : std::wstring(L"(null)");
            }
            if (precision >= 0 && text.size() > static_cast<std::size_t>(precision))
                text.resize(static_cast<std::size_t>(precision));
            out += Pad(std::move(text), width, padLeft);
            break;
        }
        case L'n':
            (void)va_arg(args, void*);
            break;
        default: // not a conversion: keep the text as written
            out.append(start, p);
        }
    }
    va_end(args);
    return out;
}

} // namespace devhost
