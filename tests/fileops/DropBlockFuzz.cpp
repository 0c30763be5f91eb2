// Fuzzes the reader of the clipboard's file list with whole blocks, ANSI and wide: whatever the bytes, it
// stays inside the block and what it gives back reads back the same from a block the explorer writes. The
// names then go through the double-NUL list the shell's file operation is given (Copy, Paste, Delete of those
// files), which must hold them whole, in order, with its final NUL inside its block.
#include "fileops/DropBlock.h"
#include "fileops/NameList.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    // A block of exactly the input's size, so that a read past it is seen by the sanitizer.
    auto* block = static_cast<unsigned char*>(std::malloc(size ? size : 1));
    if (size)
        std::memcpy(block, data, size);
    const DropList read = ReadDropList(block, size, &AsciiOnly);
    const auto& names = read.names;
    if (ReadDropBlock(block, size) != names)
        std::abort();
    std::size_t total = 0;    // the names as the explorer's double-NUL list holds them
    std::size_t consumed = 0; // the bytes of the block they came from
    for (const auto& name : names) {
        if (name.empty() || name.find('\0') != std::string::npos)
            std::abort();
        total += name.size() + 1;
        consumed += (name.size() + 1) * (read.wide ? 2 : 1);
    }
    for (const auto& name : read.unheld) {
        if (!read.wide || name.empty() || name.find(u'\0') != std::u16string::npos)
            std::abort();
        consumed += (name.size() + 1) * 2;
    }
    if (consumed > size)
        std::abort();
    std::free(block);
    const auto rebuilt = BuildDropBlock(names);
    if (rebuilt.size() % kDropBlockStep != 0 || ReadDropBlock(rebuilt.data(), rebuilt.size()) != names)
        std::abort();

    NameList list;
    for (const auto& name : names)
        list.Add(name);
    if (names.empty() ? list.Data() != nullptr : list.Data() == nullptr)
        std::abort();
    if (list.Length() != total || list.Names() != names)
        std::abort();
    if (list.Data() && (list.Capacity() < list.Length() + 1 || list.Data()[list.Length()] != '\0'))
        std::abort();
    list.Clear();
    if (list.Data() != nullptr || list.Length() != 0 || !list.Names().empty())
        std::abort();
    return 0;
}
