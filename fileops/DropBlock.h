// The clipboard's file list block (the CF_HDROP layout) as the explorer writes and reads it. Portable: no
// <windows.h>; the Windows side puts the bytes into a global memory block and takes them out again.
//
//   offset 0   pFiles  offset of the first name (20)
//   offset 4   pt.x, pt.y, fNC (0)
//   offset 16  fWide   0: ANSI names
//   offset 20  the names, full paths, each followed by one NUL; the zero-filled rest of the block ends
//              the list
//
// The block grows in steps of 4096 bytes. Reading takes the first name's offset from the low byte of
// pFiles as a signed byte and always reads ANSI names: a wide list, as other programs put there, gives only
// the first character of each name (so it holds no drawing and enables no paste).
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

constexpr std::size_t kDropHeaderSize = 20;
constexpr std::size_t kDropBlockStep = 4096;

// The block for these full paths: the header, the names, then zeros up to the next step. There is always
// at least one zero after the last name, even when the names end right at a step.
std::vector<unsigned char> BuildDropBlock(const std::vector<std::string>& paths);

// The names of a block, read as the explorer reads them. Bounded by size: a negative or too large offset
// gives no names; a name that runs to the end of the block without its NUL is dropped and ends the list.
std::vector<std::string> ReadDropBlock(const unsigned char* block, std::size_t size);

// The extension of a path as the runtime splits it (from the last dot of the file name part), with its dot.
std::string PathExtension(const std::string& path);
// True when the path's extension is ".dwg", case ignored.
bool IsDrawingPath(const std::string& path);
// True when some name of the list is a drawing: what enables Paste.
bool ListHoldsDrawings(const std::vector<std::string>& names);

// Copy to file: the chosen target, given ".DWG" when it has no extension.
std::string CopyTargetName(const std::string& chosen);
