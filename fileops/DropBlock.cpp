#include "fileops/DropBlock.h"

#include "hostapi/NarrowText.h"

#include <cstring>

namespace {

void PutU32(std::vector<unsigned char>& block, std::size_t at, std::uint32_t value) {
    for (int i = 0; i < 4; ++i)
        block[at + static_cast<std::size_t>(i)] = static_cast<unsigned char>(value >> (8 * i));
}

char Lower(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

} // namespace

std::vector<unsigned char> BuildDropBlock(const std::vector<std::string>& paths) {
    std::size_t used = kDropHeaderSize;
    for (const std::string& path : paths)
        used += path.size() + 1;
    // One more byte for the list's final NUL, then up to the next step.
    const std::size_t size = (used + 1 + kDropBlockStep - 1) / kDropBlockStep * kDropBlockStep;
    std::vector<unsigned char> block(size, 0);
    PutU32(block, 0, static_cast<std::uint32_t>(kDropHeaderSize));
    std::size_t at = kDropHeaderSize;
    for (const std::string& path : paths) {
        std::memcpy(block.data() + at, path.c_str(), path.size() + 1);
        at += path.size() + 1;
    }
    return block;
}

bool AsciiOnly(const std::u16string& wide, std::string& narrow) {
    narrow.clear();
    for (const char16_t c : wide) {
        if (c == 0 || c >= 0x80)
            return false;
        narrow += static_cast<char>(c);
    }
    return true;
}

DropList ReadDropList(const unsigned char* block, std::size_t size, const WideToNarrow& toNarrow) {
    DropList list;
    if (!block || size == 0)
        return list;
    const auto offset = static_cast<signed char>(block[0]);
    if (offset < 0 || static_cast<std::size_t>(offset) >= size)
        return list;
    // fWide is a 32-bit flag at offset 16; a block too short to hold it is read as ANSI.
    list.wide = size >= kDropHeaderSize && (block[16] | block[17] | block[18] | block[19]) != 0;
    std::size_t at = static_cast<std::size_t>(offset);
    if (!list.wide) {
        while (at < size) {
            const void* end = std::memchr(block + at, 0, size - at);
            if (!end)
                break; // no NUL before the block ends: not a name
            const std::size_t length = static_cast<const unsigned char*>(end) - (block + at);
            if (length == 0)
                break; // the empty name ends the list
            list.names.emplace_back(reinterpret_cast<const char*>(block + at), length);
            at += length + 1;
        }
        return list;
    }
    // UTF-16, little-endian, read byte by byte: the offset may be odd.
    while (at + 1 < size) {
        std::u16string name;
        bool ended = false;
        for (; at + 1 < size; at += 2) {
            const auto unit = static_cast<char16_t>(block[at] | block[at + 1] << 8);
            if (unit == 0) {
                ended = true;
                at += 2;
                break;
            }
            name += unit;
        }
        if (!ended || name.empty())
            break; // cut off by the block's end (not a name), or the empty name that ends the list
        std::string narrow;
        if (toNarrow && toNarrow(name, narrow) && !narrow.empty() && narrow.find('\0') == std::string::npos)
            list.names.push_back(std::move(narrow));
        else
            list.unheld.push_back(std::move(name));
    }
    return list;
}

std::vector<std::string> ReadDropBlock(const unsigned char* block, std::size_t size) {
    return ReadDropList(block, size, &AsciiOnly).names;
}

std::string PathExtension(const std::string& path) {
    const std::size_t separator = LastCharacterOf(path, "\\/:");
    const std::size_t nameStart = separator == std::string::npos ? 0 : separator + 1;
    const std::size_t dot = path.rfind('.');
    if (dot == std::string::npos || dot < nameStart)
        return std::string();
    return path.substr(dot);
}

bool IsDrawingPath(const std::string& path) {
    const std::string extension = PathExtension(path);
    static const char kDrawing[] = ".dwg";
    if (extension.size() != 4)
        return false;
    for (std::size_t i = 0; i < 4; ++i)
        if (Lower(extension[i]) != kDrawing[i])
            return false;
    return true;
}

bool ListHoldsDrawings(const std::vector<std::string>& names) {
    for (const std::string& name : names)
        if (IsDrawingPath(name))
            return true;
    return false;
}

bool DropListHoldsDrawings(const DropList& list) {
    if (ListHoldsDrawings(list.names))
        return true;
    // Only the extension counts: characters outside ASCII stand in as '?'.
    for (const std::u16string& wide : list.unheld) {
        std::string shown;
        for (const char16_t c : wide)
            shown += c > 0 && c < 0x80 ? static_cast<char>(c) : '?';
        if (IsDrawingPath(shown))
            return true;
    }
    return false;
}

std::string CopyTargetName(const std::string& chosen) {
    if (chosen.empty() || !PathExtension(chosen).empty())
        return chosen;
    return chosen + ".DWG";
}
