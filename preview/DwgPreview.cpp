#include "preview/DwgPreview.h"

#include <cstdio>
#include <cstring>
#include <memory>

namespace {

std::uint32_t Le32(const unsigned char* p) {
    return static_cast<std::uint32_t>(p[0]) | (static_cast<std::uint32_t>(p[1]) << 8) |
           (static_cast<std::uint32_t>(p[2]) << 16) | (static_cast<std::uint32_t>(p[3]) << 24);
}
std::uint16_t Le16(const unsigned char* p) {
    return static_cast<std::uint16_t>(p[0] | (p[1] << 8));
}
std::uint32_t Be32(const unsigned char* p) {
    return (static_cast<std::uint32_t>(p[0]) << 24) | (static_cast<std::uint32_t>(p[1]) << 16) |
           (static_cast<std::uint32_t>(p[2]) << 8) | static_cast<std::uint32_t>(p[3]);
}

// Where the picture lies in the file.
struct Located {
    DwgPreviewKind kind = DwgPreviewKind::None;
    std::uint64_t start = 0;
    std::uint32_t size = 0;
};

// The image section's address from the file header, when the release has one.
bool SectionAddress(const unsigned char* header, std::size_t size, std::uint64_t fileSize,
                    std::uint64_t& address) {
    if (size < dwgfmt::kFileHeaderBytes || !dwgfmt::HasImageSection(header, size))
        return false;
    address = Le32(header + dwgfmt::kImageAddressOffset);
    return address + dwgfmt::kSectionHeadBytes <= fileSize;
}

// Bytes of the section head and entry table that a reader should fetch at address.
std::size_t SectionReadSize(std::uint64_t address, std::uint64_t fileSize) {
    const std::uint64_t most = dwgfmt::kSectionHeadBytes + 255 * dwgfmt::kEntryBytes;
    const std::uint64_t left = fileSize - address;
    return static_cast<std::size_t>(left < most ? left : most);
}

DwgPreviewKind KindOf(unsigned char code) {
    switch (code) {
    case dwgfmt::kBmp:
        return DwgPreviewKind::Bmp;
    case dwgfmt::kWmf:
        return DwgPreviewKind::Wmf;
    case dwgfmt::kPng:
        return DwgPreviewKind::Png;
    default:
        return DwgPreviewKind::None;
    }
}

// Rank of a picture kind when a section lists several: the bitmap kinds draw best.
int Preference(DwgPreviewKind kind) {
    switch (kind) {
    case DwgPreviewKind::Bmp:
    case DwgPreviewKind::Png:
        return 2;
    case DwgPreviewKind::Wmf:
        return 1;
    default:
        return 0;
    }
}

// Checks the section head at address and picks its picture entry.
bool LocateImage(const unsigned char* section, std::size_t size, std::uint64_t address,
                 std::uint64_t fileSize, Located& found) {
    if (size < dwgfmt::kSectionHeadBytes ||
        std::memcmp(section, dwgfmt::kImageSentinel, sizeof dwgfmt::kImageSentinel) != 0)
        return false;
    const std::uint32_t sectionSize = Le32(section + 16);
    const unsigned count = section[20];
    // The section size counts from the entry count to the end of the last picture.
    if (count == 0 || address + 20 + static_cast<std::uint64_t>(sectionSize) > fileSize ||
        sectionSize < 1 + count * dwgfmt::kEntryBytes)
        return false;
    if (size < dwgfmt::kSectionHeadBytes + count * dwgfmt::kEntryBytes)
        return false;
    const std::uint64_t dataBegin = address + dwgfmt::kSectionHeadBytes + count * dwgfmt::kEntryBytes;
    const std::uint64_t sectionEnd = address + 20 + sectionSize;
    for (unsigned i = 0; i < count; ++i) {
        const unsigned char* entry = section + dwgfmt::kSectionHeadBytes + i * dwgfmt::kEntryBytes;
        const DwgPreviewKind kind = KindOf(entry[0]);
        if (kind == DwgPreviewKind::None)
            continue;
        const std::uint64_t start = Le32(entry + 1);
        const std::uint32_t length = Le32(entry + 5);
        if (length == 0 || length > kMaxPictureBytes || start < dataBegin || start + length > sectionEnd)
            continue; // an entry pointing outside its section, or claiming more than a preview, is not trusted
        if (Preference(kind) > Preference(found.kind)) {
            found.kind = kind;
            found.start = start;
            found.size = length;
        }
    }
    return found.kind != DwgPreviewKind::None;
}

bool MeasureDib(const unsigned char* p, std::size_t size, int& width, int& height) {
    if (size < 40)
        return false;
    const std::uint32_t headerSize = Le32(p);
    if (headerSize < 40 || headerSize > size)
        return false;
    const std::int32_t w = static_cast<std::int32_t>(Le32(p + 4));
    const std::int32_t h = static_cast<std::int32_t>(Le32(p + 8));
    const unsigned planes = Le16(p + 12);
    const unsigned bits = Le16(p + 14);
    const std::uint32_t compression = Le32(p + 16);
    const std::uint32_t imageSize = Le32(p + 20);
    const std::uint32_t colorsUsed = Le32(p + 32);
    if (w <= 0 || h == 0 || h == INT32_MIN || w > 65535 || h > 65535 || h < -65535 || planes != 1)
        return false;
    const std::uint64_t rows = static_cast<std::uint64_t>(h < 0 ? -static_cast<std::int64_t>(h) : h);
    std::uint64_t colors = 0;
    switch (bits) {
    case 1:
    case 4:
    case 8:
        colors = colorsUsed != 0 ? colorsUsed : (1u << bits);
        if (colors > (1u << bits))
            return false;
        break;
    case 16:
    case 24:
    case 32:
        colors = colorsUsed;
        if (colors > 256)
            return false;
        break;
    default:
        return false;
    }
    std::uint64_t need = headerSize + colors * 4;
    const std::uint64_t stride = ((static_cast<std::uint64_t>(w) * bits + 31) / 32) * 4;
    switch (compression) {
    case 0: // BI_RGB
        need += stride * rows;
        break;
    case 3: // BI_BITFIELDS: three masks after a 40-byte header
        if (bits != 16 && bits != 32)
            return false;
        if (headerSize == 40)
            need += 12;
        need += stride * rows;
        break;
    case 1: // BI_RLE8
    case 2: // BI_RLE4
        if ((compression == 1 && bits != 8) || (compression == 2 && bits != 4) || h < 0 || imageSize == 0)
            return false;
        need += imageSize;
        break;
    default:
        return false;
    }
    if (need > size)
        return false;
    width = w;
    height = static_cast<int>(rows);
    return true;
}

bool MeasurePng(const unsigned char* p, std::size_t size, int& width, int& height) {
    static const unsigned char signature[8] = {0x89, 'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A};
    if (size < 33 || std::memcmp(p, signature, 8) != 0 || Be32(p + 8) != 13 ||
        std::memcmp(p + 12, "IHDR", 4) != 0)
        return false;
    const std::uint32_t w = Be32(p + 16);
    const std::uint32_t h = Be32(p + 20);
    // Decoded, the picture takes 4 bytes a pixel: a small file may claim a huge one.
    if (w == 0 || h == 0 || w > kMaxPictureSide || h > kMaxPictureSide ||
        static_cast<std::uint64_t>(w) * h * 4 > kMaxDecodedBytes)
        return false;
    width = static_cast<int>(w);
    height = static_cast<int>(h);
    return true;
}

// The metafile's header and its records, as the metafile player will read them: the header's own size,
// a total size within the bytes present, and every record (size in 16-bit words, at least 3) inside that
// total, up to the end record. The player trusts these sizes.
bool MetafileRecordsFit(const unsigned char* p, std::size_t size) {
    constexpr std::size_t kMetaHeaderBytes = 18;
    if (size < kMetaHeaderBytes)
        return false;
    const unsigned type = Le16(p);
    const unsigned headerWords = Le16(p + 2);
    const std::uint64_t totalBytes = static_cast<std::uint64_t>(Le32(p + 6)) * 2;
    if ((type != 1 && type != 2) || headerWords != kMetaHeaderBytes / 2 || totalBytes < kMetaHeaderBytes ||
        totalBytes > size)
        return false;
    std::uint64_t at = kMetaHeaderBytes;
    while (at + 6 <= totalBytes) {
        const std::uint64_t recordBytes = static_cast<std::uint64_t>(Le32(p + at)) * 2;
        const unsigned function = Le16(p + at + 4);
        if (recordBytes < 6 || at + recordBytes > totalBytes)
            return false;
        if (function == 0)
            return true; // the end record
        at += recordBytes;
    }
    return at == totalBytes; // every record fits, though the end record is missing
}

bool MeasureWmf(const unsigned char* p, std::size_t size, int& width, int& height) {
    constexpr std::uint32_t kPlaceableKey = 0x9AC6CDD7;
    constexpr std::size_t kPlaceableBytes = 22;
    width = 0;
    height = 0;
    if (size >= 4 && Le32(p) == kPlaceableKey) {
        if (size < kPlaceableBytes || !MetafileRecordsFit(p + kPlaceableBytes, size - kPlaceableBytes))
            return false;
        const int left = static_cast<std::int16_t>(Le16(p + 6));
        const int top = static_cast<std::int16_t>(Le16(p + 8));
        const int right = static_cast<std::int16_t>(Le16(p + 10));
        const int bottom = static_cast<std::int16_t>(Le16(p + 12));
        width = right > left ? right - left : left - right;
        height = bottom > top ? bottom - top : top - bottom;
        return true;
    }
    return MetafileRecordsFit(p, size);
}

// Fills out from the located bytes once they are in memory.
bool Finish(const Located& found, std::vector<unsigned char>&& bytes, DwgPreview& out) {
    int width = 0, height = 0;
    if (!MeasurePreviewImage(found.kind, bytes.data(), bytes.size(), width, height))
        return false;
    out.kind = found.kind;
    out.bytes = std::move(bytes);
    out.width = width;
    out.height = height;
    return true;
}

struct FileCloser {
    void operator()(std::FILE* f) const { std::fclose(f); }
};
using FilePtr = std::unique_ptr<std::FILE, FileCloser>;

bool SeekTo(std::FILE* f, std::uint64_t offset) {
#ifdef _WIN32
    return _fseeki64(f, static_cast<long long>(offset), SEEK_SET) == 0;
#else
    return fseeko(f, static_cast<off_t>(offset), SEEK_SET) == 0;
#endif
}

bool FileSize(std::FILE* f, std::uint64_t& size) {
#ifdef _WIN32
    if (_fseeki64(f, 0, SEEK_END) != 0)
        return false;
    const long long end = _ftelli64(f);
#else
    if (fseeko(f, 0, SEEK_END) != 0)
        return false;
    const off_t end = ftello(f);
#endif
    if (end < 0)
        return false;
    size = static_cast<std::uint64_t>(end);
    return true;
}

bool ReadAt(std::FILE* f, std::uint64_t offset, unsigned char* buffer, std::size_t size) {
    return SeekTo(f, offset) && std::fread(buffer, 1, size, f) == size;
}

bool ReadFromFile(std::FILE* raw, DwgPreview& out) {
    FilePtr file(raw);
    if (!file)
        return false;
    std::uint64_t fileSize = 0;
    if (!FileSize(file.get(), fileSize) || fileSize < dwgfmt::kFileHeaderBytes)
        return false;
    unsigned char header[dwgfmt::kFileHeaderBytes];
    if (!ReadAt(file.get(), 0, header, sizeof header))
        return false;
    std::uint64_t address = 0;
    if (!SectionAddress(header, sizeof header, fileSize, address))
        return false;
    unsigned char section[dwgfmt::kSectionHeadBytes + 255 * dwgfmt::kEntryBytes];
    const std::size_t sectionBytes = SectionReadSize(address, fileSize);
    if (!ReadAt(file.get(), address, section, sectionBytes))
        return false;
    Located found;
    if (!LocateImage(section, sectionBytes, address, fileSize, found))
        return false;
    std::vector<unsigned char> bytes(found.size);
    if (!ReadAt(file.get(), found.start, bytes.data(), bytes.size()))
        return false;
    return Finish(found, std::move(bytes), out);
}

} // namespace

namespace dwgfmt {
bool HasImageSection(const unsigned char* magic, std::size_t size) {
    if (size < 6 || magic[0] != 'A' || magic[1] != 'C')
        return false;
    int release = 0;
    for (int i = 2; i < 6; ++i) {
        if (magic[i] < '0' || magic[i] > '9')
            return false;
        release = release * 10 + (magic[i] - '0');
    }
    return release >= 1012;
}
} // namespace dwgfmt

bool MeasurePreviewImage(DwgPreviewKind kind, const unsigned char* data, std::size_t size, int& width,
                         int& height) {
    if (data == nullptr)
        return false;
    switch (kind) {
    case DwgPreviewKind::Bmp:
        return MeasureDib(data, size, width, height);
    case DwgPreviewKind::Png:
        return MeasurePng(data, size, width, height);
    case DwgPreviewKind::Wmf:
        return MeasureWmf(data, size, width, height);
    default:
        return false;
    }
}

bool ParseDwgPreview(const unsigned char* data, std::size_t size, DwgPreview& out) {
    if (data == nullptr)
        return false;
    std::uint64_t address = 0;
    if (!SectionAddress(data, size, size, address))
        return false;
    const std::size_t sectionBytes = SectionReadSize(address, size);
    Located found;
    if (!LocateImage(data + address, sectionBytes, address, size, found))
        return false;
    const unsigned char* image = data + found.start;
    return Finish(found, std::vector<unsigned char>(image, image + found.size), out);
}

bool ReadDwgPreview(const std::string& path, DwgPreview& out) {
    return ReadFromFile(std::fopen(path.c_str(), "rb"), out);
}

#ifdef _WIN32
bool ReadDwgPreview(const std::wstring& path, DwgPreview& out) {
    return ReadFromFile(_wfopen(path.c_str(), L"rb"), out);
}
#endif
