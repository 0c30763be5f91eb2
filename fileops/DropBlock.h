// The clipboard's file list block (the CF_HDROP layout) as the explorer writes and reads it. Portable: no
// <windows.h>; the Windows side puts the bytes into a global memory block and takes them out again.
//
//   offset 0   pFiles  offset of the first name (20)
//   offset 4   pt.x, pt.y, fNC (0)
//   offset 16  fWide   0: ANSI names (the explorer writes these); not 0: UTF-16 names
//   offset 20  the names, full paths, each followed by one NUL; the zero-filled rest of the block ends
//              the list
//
// The block grows in steps of 4096 bytes. Reading takes the first name's offset from the low byte of
// pFiles as a signed byte. A wide list (the system's file manager and most programs put one there) is read
// as wide, and each name is turned into the code page the explorer works in; a name the code page cannot
// hold exactly is kept apart, never changed into another name.
#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

constexpr std::size_t kDropHeaderSize = 20;
constexpr std::size_t kDropBlockStep = 4096;

// The block for these full paths: the header, the names, then zeros up to the next step. There is always
// at least one zero after the last name, even when the names end right at a step.
std::vector<unsigned char> BuildDropBlock(const std::vector<std::string>& paths);

// Turns a wide name into the explorer's code page; false when the code page cannot hold it exactly.
using WideToNarrow = std::function<bool(const std::u16string& wide, std::string& narrow)>;
// Holds only the characters below 128 (the same in every code page): what portable code can be sure of.
bool AsciiOnly(const std::u16string& wide, std::string& narrow);

// The names of a block, as the explorer reads it.
struct DropList {
    bool wide = false;                  // the block's names are UTF-16
    std::vector<std::string> names;     // the names, in the explorer's code page, in list order
    std::vector<std::u16string> unheld; // wide names the code page cannot hold: not taken
};

// Bounded by size: a negative or too large offset gives no names; a name that runs to the end of the block
// without its NUL (a wide name: its two-byte NUL) is dropped and ends the list; the empty name ends it too.
DropList ReadDropList(const unsigned char* block, std::size_t size, const WideToNarrow& toNarrow);
// The names ReadDropList takes, wide ones converted by AsciiOnly.
std::vector<std::string> ReadDropBlock(const unsigned char* block, std::size_t size);

// The extension of a path as the runtime splits it (from the last dot of the file name part), with its dot.
std::string PathExtension(const std::string& path);
// True when the path's extension is ".dwg", case ignored.
bool IsDrawingPath(const std::string& path);
// True when some name of the list is a drawing: what enables Paste.
bool ListHoldsDrawings(const std::vector<std::string>& names);
// The same for a list read from a block, the names the code page cannot hold included: Paste is offered,
// and then says why those are not pasted.
bool DropListHoldsDrawings(const DropList& list);

// Copy to file: the chosen target, given ".DWG" when it has no extension.
std::string CopyTargetName(const std::string& chosen);
