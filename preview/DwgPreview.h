// Reads the preview picture a drawing file carries (release 13 and later): the image section whose
// address sits at offset 0x0D, found by its sentinel, and the first picture it lists. Portable: no
// <windows.h>. Damaged or hostile files give false; nothing is ever read outside the file.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

enum class DwgPreviewKind { None, Bmp, Wmf, Png };

struct DwgPreview {
    DwgPreviewKind kind = DwgPreviewKind::None;
    std::vector<unsigned char> bytes; // BMP: a DIB without file header; PNG and WMF: the file as stored
    int width = 0;
    int height = 0;
};

// Layout of the container, shared with the sample generator.
// Limits of what a preview may claim before anything is allocated or decoded: a picture entry's bytes,
// a PNG's side and its decoded size (4 bytes a pixel).
constexpr std::uint32_t kMaxPictureBytes = 16u << 20;
constexpr std::uint32_t kMaxPictureSide = 4096;
constexpr std::uint64_t kMaxDecodedBytes = 16u << 20;

namespace dwgfmt {
constexpr std::size_t kImageAddressOffset = 0x0D;
constexpr std::size_t kFileHeaderBytes = kImageAddressOffset + 4;
constexpr unsigned char kImageSentinel[16] = {0x1F, 0x25, 0x6D, 0x07, 0xD4, 0x36, 0x28, 0x28,
                                              0x9D, 0x57, 0xCA, 0x3F, 0x9D, 0x44, 0x10, 0x2B};
// Sentinel, section size (4 bytes), entry count (1 byte).
constexpr std::size_t kSectionHeadBytes = 16 + 4 + 1;
// Code (1 byte), start (4 bytes, from the beginning of the file), size (4 bytes).
constexpr std::size_t kEntryBytes = 9;
enum EntryCode : unsigned char { kHeader = 1, kBmp = 2, kWmf = 3, kPng = 6 };
// Release 13 ("AC1012") is the first with an image section.
bool HasImageSection(const unsigned char* magic, std::size_t size);
} // namespace dwgfmt

// false: no preview in the file, or the file is damaged, or it cannot be read.
bool ReadDwgPreview(const std::string& path, DwgPreview& out);
#ifdef _WIN32
bool ReadDwgPreview(const std::wstring& path, DwgPreview& out);
#endif
// The same from a whole file in memory.
bool ParseDwgPreview(const unsigned char* data, std::size_t size, DwgPreview& out);

// Picture size from the image bytes: the DIB's BITMAPINFOHEADER, the PNG's IHDR, or the WMF
// placeable header (0 x 0 without one). false when the bytes are not a usable picture of that kind.
bool MeasurePreviewImage(DwgPreviewKind kind, const unsigned char* data, std::size_t size, int& width,
                         int& height);
