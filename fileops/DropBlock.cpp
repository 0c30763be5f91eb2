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

std::vector<std::string> ReadDropBlock(const unsigned char* block, std::size_t size) {
    std::vector<std::string> names;
    if (!block || size == 0)
        return names;
    const auto offset = static_cast<signed char>(block[0]);
    if (offset < 0 || static_cast<std::size_t>(offset) >= size)
        return names;
    std::size_t at = static_cast<std::size_t>(offset);
    while (at < size) {
        const void* end = std::memchr(block + at, 0, size - at);
        if (!end)
            break; // no NUL before the block ends: not a name
        const std::size_t length = static_cast<const unsigned char*>(end) - (block + at);
        if (length == 0)
            break; // the empty name ends the list
        names.emplace_back(reinterpret_cast<const char*>(block + at), length);
        at += length + 1;
    }
    return names;
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

std::string CopyTargetName(const std::string& chosen) {
    if (chosen.empty() || !PathExtension(chosen).empty())
        return chosen;
    return chosen + ".DWG";
}
