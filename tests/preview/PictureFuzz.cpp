// Fuzzes the checks a picture passes before it is drawn (MeasurePreviewImage): the first byte chooses the
// kind, the rest is the picture, in a block of exactly its size. An accepted picture must hold everything
// the drawing code will read, as the system's bitmap, PNG and metafile code would read it.
#include "preview/DwgPreview.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace {

std::uint32_t Le32(const unsigned char* p) {
    return p[0] | (p[1] << 8) | (p[2] << 16) | (static_cast<std::uint32_t>(p[3]) << 24);
}
unsigned Le16(const unsigned char* p) {
    return p[0] | (p[1] << 8);
}

// A DIB's header, palette and pixel rows as the blitter reads them: everything must be inside.
void CheckDib(const unsigned char* p, std::size_t size, int width, int height) {
    if (width <= 0 || height <= 0 || width > 65535 || height > 65535)
        std::abort();
    const std::uint32_t headerSize = Le32(p);
    const unsigned bits = Le16(p + 14);
    const std::uint32_t compression = Le32(p + 16);
    const std::uint64_t stride = ((static_cast<std::uint64_t>(width) * bits + 31) / 32) * 4;
    std::uint64_t palette = Le32(p + 32);
    if (bits <= 8 && palette == 0)
        palette = 1u << bits;
    std::uint64_t need = static_cast<std::uint64_t>(headerSize) + palette * 4;
    if (compression == 0 || compression == 3)
        need += stride * static_cast<std::uint64_t>(height) + (compression == 3 && headerSize == 40 ? 12 : 0);
    else
        need += Le32(p + 20);
    if (need > size)
        std::abort();
    // Touch the last byte the blitter reads: a wrong size shows up as a read outside the block.
    volatile unsigned char last = p[need - 1];
    (void)last;
}

void CheckPng(int width, int height) {
    if (width <= 0 || height <= 0 || static_cast<std::uint32_t>(width) > kMaxPictureSide ||
        static_cast<std::uint32_t>(height) > kMaxPictureSide ||
        static_cast<std::uint64_t>(width) * static_cast<std::uint64_t>(height) * 4 > kMaxDecodedBytes)
        std::abort();
}

// The metafile player walks the records by their sizes up to the end record or the total size.
void CheckWmf(const unsigned char* p, std::size_t size, int width, int height) {
    if (width < 0 || height < 0 || width > 65535 || height > 65535)
        std::abort();
    std::size_t at = 0;
    if (size >= 4 && Le32(p) == 0x9AC6CDD7u)
        at = 22;
    const unsigned char* meta = p + at;
    const std::size_t metaSize = size - at;
    if (metaSize < 18)
        std::abort();
    const std::uint64_t total = static_cast<std::uint64_t>(Le32(meta + 6)) * 2;
    if (total > metaSize)
        std::abort();
    std::uint64_t record = 18;
    while (record + 6 <= total) {
        const std::uint64_t bytes = static_cast<std::uint64_t>(Le32(meta + record)) * 2;
        if (bytes < 6 || record + bytes > total)
            std::abort();
        volatile unsigned char end = meta[record + bytes - 1];
        (void)end;
        if (Le16(meta + record + 4) == 0)
            break;
        record += bytes;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0)
        return 0;
    const DwgPreviewKind kinds[] = {DwgPreviewKind::None, DwgPreviewKind::Bmp, DwgPreviewKind::Wmf,
                                    DwgPreviewKind::Png};
    const DwgPreviewKind kind = kinds[data[0] % 4];
    const std::size_t pictureSize = size - 1;
    auto* picture = static_cast<unsigned char*>(std::malloc(pictureSize ? pictureSize : 1));
    if (pictureSize)
        std::memcpy(picture, data + 1, pictureSize);
    int width = -1, height = -1;
    const bool usable = MeasurePreviewImage(kind, picture, pictureSize, width, height);
    if (usable) {
        switch (kind) {
        case DwgPreviewKind::Bmp:
            CheckDib(picture, pictureSize, width, height);
            break;
        case DwgPreviewKind::Png:
            CheckPng(width, height);
            break;
        case DwgPreviewKind::Wmf:
            CheckWmf(picture, pictureSize, width, height);
            break;
        default:
            std::abort(); // no picture of no kind
        }
    }
    // The same bytes give the same answer every time.
    int again_width = -1, again_height = -1;
    if (MeasurePreviewImage(kind, picture, pictureSize, again_width, again_height) != usable ||
        (usable && (again_width != width || again_height != height)))
        std::abort();
    if (MeasurePreviewImage(kind, nullptr, pictureSize, again_width, again_height))
        std::abort();
    std::free(picture);
    return 0;
}
