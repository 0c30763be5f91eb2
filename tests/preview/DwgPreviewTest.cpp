#include "preview/DwgPreview.h"

#include "SyntheticDwg.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>

#include <sys/stat.h>

#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string>
#include <vector>

#ifdef _WIN32
#include <direct.h>
#endif

namespace {

const std::string kSamples = ORVEX_SAMPLES_DIR;

bool IsDirectory(const std::string& path) {
    struct stat st;
    return stat(path.c_str(), &st) == 0 && (st.st_mode & S_IFDIR) != 0;
}

std::vector<unsigned char> ReadAll(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    return std::vector<unsigned char>((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
}

void WriteAll(const std::string& path, const std::vector<unsigned char>& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

std::string TempDir() {
    static const testsupport::TempFolder scratch("orvex-preview"); // one for the program, removed at its end
    return scratch.Dir();
}

void MakeDir(const std::string& path) {
#ifdef _WIN32
    _mkdir(path.c_str());
#else
    mkdir(path.c_str(), 0755);
#endif
}

void PutLe32(std::vector<unsigned char>& v, std::size_t at, std::uint32_t x) {
    if (at + 4 > v.size())
        throw std::out_of_range("PutLe32 outside the buffer");
    const unsigned char bytes[4] = {static_cast<unsigned char>(x), static_cast<unsigned char>(x >> 8),
                                    static_cast<unsigned char>(x >> 16), static_cast<unsigned char>(x >> 24)};
    std::copy(bytes, bytes + 4, v.begin() + static_cast<std::ptrdiff_t>(at));
}

struct Entry {
    unsigned char code;
    std::vector<unsigned char> bytes;
};

// A container with the given entries laid out one after the other behind the entry table.
std::vector<unsigned char> Container(const std::vector<Entry>& entries, const char* magic = "AC1018",
                                     std::size_t address = 0x40) {
    std::size_t data = address + dwgfmt::kSectionHeadBytes + entries.size() * dwgfmt::kEntryBytes;
    std::size_t end = data;
    for (const Entry& e : entries)
        end += e.bytes.size();
    std::vector<unsigned char> file(end + 16, 0);
    std::memcpy(file.data(), magic, 6);
    PutLe32(file, dwgfmt::kImageAddressOffset, static_cast<std::uint32_t>(address));
    std::memcpy(&file[address], dwgfmt::kImageSentinel, 16);
    PutLe32(file, address + 16, static_cast<std::uint32_t>(end - (address + 20)));
    file[address + 20] = static_cast<unsigned char>(entries.size());
    std::size_t at = address + dwgfmt::kSectionHeadBytes;
    for (const Entry& e : entries) {
        file[at] = e.code;
        PutLe32(file, at + 1, static_cast<std::uint32_t>(data));
        PutLe32(file, at + 5, static_cast<std::uint32_t>(e.bytes.size()));
        std::copy(e.bytes.begin(), e.bytes.end(), file.begin() + static_cast<std::ptrdiff_t>(data));
        data += e.bytes.size();
        at += dwgfmt::kEntryBytes;
    }
    return file;
}

std::vector<unsigned char> SmallDib(int w = 12, int h = 8, int bpp = 24) {
    dwggen::PictureOptions p;
    p.width = w;
    p.height = h;
    p.bitsPerPixel = bpp;
    return dwggen::DrawDib(p, 42);
}

std::vector<unsigned char> MinimalPng(std::uint32_t w, std::uint32_t h) {
    std::vector<unsigned char> png = {0x89, 'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A,
                                      0,    0,   0,   13,  'I',  'H',  'D',  'R'};
    for (std::uint32_t v : {w, h})
        for (int i = 3; i >= 0; --i)
            png.push_back(static_cast<unsigned char>(v >> (8 * i)));
    for (unsigned char b : {8, 2, 0, 0, 0, 0, 0, 0, 0})
        png.push_back(b); // depth, colour type, methods, CRC (not checked here)
    return png;
}

// A metafile of little-endian 16-bit words.
std::vector<unsigned char> Words(std::initializer_list<unsigned> words) {
    std::vector<unsigned char> bytes;
    for (unsigned w : words) {
        bytes.push_back(static_cast<unsigned char>(w & 0xFF));
        bytes.push_back(static_cast<unsigned char>(w >> 8));
    }
    return bytes;
}

// The smallest metafile: its header (12 words in all, largest record 3) and the end record.
std::vector<unsigned char> MinimalWmf() {
    return Words({1, 9, 0x0300, 12, 0, 0, 3, 0, 0, 3, 0, 0});
}

bool Parse(const std::vector<unsigned char>& file, DwgPreview& out) {
    return ParseDwgPreview(file.data(), file.size(), out);
}

// --- The real sample drawings ----------------------------------------------------------------------

struct ManifestRow {
    std::string file, magic, kind;
    int width = 0, height = 0;
    std::size_t bytes = 0;
};

std::vector<ManifestRow> Manifest() {
    std::vector<ManifestRow> rows;
    std::ifstream in(kSamples + "/MANIFEST.csv");
    std::string line;
    std::getline(in, line); // heading
    while (std::getline(in, line)) {
        if (!line.empty() && line.back() == '\r')
            line.pop_back();
        if (line.empty())
            continue;
        std::stringstream fields(line);
        ManifestRow r;
        std::string w, h, b;
        std::getline(fields, r.file, ',');
        std::getline(fields, r.magic, ',');
        std::getline(fields, r.kind, ',');
        std::getline(fields, w, ',');
        std::getline(fields, h, ',');
        std::getline(fields, b, ',');
        r.width = std::stoi(w);
        r.height = std::stoi(h);
        r.bytes = static_cast<std::size_t>(std::stoul(b));
        rows.push_back(r);
    }
    return rows;
}

DwgPreviewKind KindOf(const std::string& kind) {
    if (kind == "bmp")
        return DwgPreviewKind::Bmp;
    if (kind == "png")
        return DwgPreviewKind::Png;
    if (kind == "wmf")
        return DwgPreviewKind::Wmf;
    return DwgPreviewKind::None;
}

#define SKIP_WITHOUT_SAMPLES()                                                                               \
    if (!IsDirectory(kSamples))                                                                              \
    GTEST_SKIP() << "sample drawings not found at " << kSamples                                              \
                 << " (the shared dwg-samples folder beside the "                                            \
                    "repository); skipping"

TEST(DwgPreviewSamples, EveryManifestFileMatches) {
    SKIP_WITHOUT_SAMPLES();
    const auto rows = Manifest();
    ASSERT_GT(rows.size(), 50u);
    int withPreview = 0;
    for (const ManifestRow& r : rows) {
        SCOPED_TRACE(r.file);
        DwgPreview p;
        const bool read = ReadDwgPreview(kSamples + "/" + r.file, p);
        const DwgPreviewKind want = KindOf(r.kind);
        if (want == DwgPreviewKind::None) {
            EXPECT_FALSE(read);
            EXPECT_EQ(p.kind, DwgPreviewKind::None);
            continue;
        }
        ++withPreview;
        ASSERT_TRUE(read);
        EXPECT_EQ(p.kind, want);
        EXPECT_EQ(p.width, r.width);
        EXPECT_EQ(p.height, r.height);
        EXPECT_EQ(p.bytes.size(), r.bytes);
    }
    EXPECT_GT(withPreview, 50);
}

TEST(DwgPreviewSamples, MemoryParseAgreesWithFileRead) {
    SKIP_WITHOUT_SAMPLES();
    for (const ManifestRow& r : Manifest()) {
        SCOPED_TRACE(r.file);
        const auto bytes = ReadAll(kSamples + "/" + r.file);
        DwgPreview fromFile, fromMemory;
        const bool a = ReadDwgPreview(kSamples + "/" + r.file, fromFile);
        const bool b = ParseDwgPreview(bytes.data(), bytes.size(), fromMemory);
        ASSERT_EQ(a, b);
        EXPECT_EQ(fromFile.kind, fromMemory.kind);
        EXPECT_EQ(fromFile.bytes, fromMemory.bytes);
    }
}

TEST(DwgPreviewSamples, BitmapHasNoFileHeaderAndPngItsSignature) {
    SKIP_WITHOUT_SAMPLES();
    DwgPreview bmp, png;
    ASSERT_TRUE(ReadDwgPreview(kSamples + "/2004/Arc.dwg", bmp));
    ASSERT_GE(bmp.bytes.size(), 40u);
    EXPECT_EQ(bmp.bytes[0], 40); // BITMAPINFOHEADER, no "BM"
    ASSERT_TRUE(ReadDwgPreview(kSamples + "/2013/Arc.dwg", png));
    EXPECT_EQ(std::memcmp(png.bytes.data(), "\x89PNG", 4), 0);
}

TEST(DwgPreviewSamples, EveryTruncationOfARealFileIsSafe) {
    SKIP_WITHOUT_SAMPLES();
    const auto bytes = ReadAll(kSamples + "/2013/Arc.dwg");
    const std::size_t pictureEnd = 567 + 1088; // the PNG entry's start and size
    ASSERT_GT(bytes.size(), pictureEnd + 50);
    for (std::size_t n = 0; n < pictureEnd + 50; ++n) {
        DwgPreview p;
        std::vector<unsigned char> cut(bytes.begin(), bytes.begin() + static_cast<std::ptrdiff_t>(n));
        EXPECT_EQ(ParseDwgPreview(cut.data(), cut.size(), p), n >= pictureEnd) << n;
    }
}

// --- Synthetic and damaged files -------------------------------------------------------------------

TEST(DwgPreview, ReadsBitmapOfContainer) {
    const auto dib = SmallDib();
    DwgPreview p;
    ASSERT_TRUE(
        Parse(Container({{dwgfmt::kHeader, std::vector<unsigned char>(80, 1)}, {dwgfmt::kBmp, dib}}), p));
    EXPECT_EQ(p.kind, DwgPreviewKind::Bmp);
    EXPECT_EQ(p.width, 12);
    EXPECT_EQ(p.height, 8);
    EXPECT_EQ(p.bytes, dib);
}

TEST(DwgPreview, ReadsPngSize) {
    DwgPreview p;
    ASSERT_TRUE(Parse(
        Container({{dwgfmt::kHeader, std::vector<unsigned char>(80)}, {dwgfmt::kPng, MinimalPng(704, 448)}}),
        p));
    EXPECT_EQ(p.kind, DwgPreviewKind::Png);
    EXPECT_EQ(p.width, 704);
    EXPECT_EQ(p.height, 448);
}

TEST(DwgPreview, ReadsWmfWithAndWithoutPlaceableHeader) {
    std::vector<unsigned char> placeable(22, 0);
    const std::vector<unsigned char> body = MinimalWmf();
    placeable.insert(placeable.end(), body.begin(), body.end());
    PutLe32(placeable, 0, 0x9AC6CDD7);
    placeable[6] = 10;    // left
    placeable[8] = 20;    // top
    placeable[10] = 0x2C; // right = 300
    placeable[11] = 0x01;
    placeable[12] = 0xF4; // bottom = 500
    placeable[13] = 0x01;
    DwgPreview p;
    ASSERT_TRUE(Parse(Container({{dwgfmt::kWmf, placeable}}), p));
    EXPECT_EQ(p.kind, DwgPreviewKind::Wmf);
    EXPECT_EQ(p.width, 290);
    EXPECT_EQ(p.height, 480);

    DwgPreview plain;
    ASSERT_TRUE(Parse(Container({{dwgfmt::kWmf, MinimalWmf()}}), plain));
    EXPECT_EQ(plain.width, 0);
    EXPECT_EQ(plain.height, 0);
    EXPECT_FALSE(Parse(Container({{dwgfmt::kWmf, std::vector<unsigned char>(10, 1)}}), plain));
}

TEST(DwgPreview, PrefersBitmapOverMetafile) {
    std::vector<unsigned char> wmf = MinimalWmf();
    DwgPreview p;
    ASSERT_TRUE(Parse(Container({{dwgfmt::kHeader, std::vector<unsigned char>(80)},
                                 {dwgfmt::kWmf, wmf},
                                 {dwgfmt::kBmp, SmallDib()}}),
                      p));
    EXPECT_EQ(p.kind, DwgPreviewKind::Bmp);
}

TEST(DwgPreview, SkipsUnknownEntryCodes) {
    DwgPreview p;
    ASSERT_TRUE(Parse(Container({{9, std::vector<unsigned char>(30, 7)}, {dwgfmt::kBmp, SmallDib()}}), p));
    EXPECT_EQ(p.kind, DwgPreviewKind::Bmp);
}

TEST(DwgPreview, HeaderOnlyOrNoEntriesMeansNoPreview) {
    DwgPreview p;
    EXPECT_FALSE(Parse(Container({{dwgfmt::kHeader, std::vector<unsigned char>(80)}}), p));
    EXPECT_FALSE(Parse(Container({}), p));
    EXPECT_EQ(p.kind, DwgPreviewKind::None);
}

TEST(DwgPreview, ReleasesBeforeR13HaveNoSection) {
    const auto good = Container({{dwgfmt::kBmp, SmallDib()}});
    for (const char* magic : {"AC1009", "AC1.40", "AC2.10", "AC1003", "XX1018", "AC10a8"}) {
        auto file = good;
        std::memcpy(file.data(), magic, 6);
        DwgPreview p;
        EXPECT_FALSE(Parse(file, p)) << magic;
    }
    for (const char* magic : {"AC1012", "AC1014", "AC1032"}) {
        auto file = good;
        std::memcpy(file.data(), magic, 6);
        DwgPreview p;
        EXPECT_TRUE(Parse(file, p)) << magic;
    }
}

TEST(DwgPreview, WrongAddressIsRejected) {
    const auto good = Container({{dwgfmt::kBmp, SmallDib()}});
    for (std::uint32_t address :
         {0u, 0x3Fu, 0x41u, 0x7FFFFFFFu, 0xFFFFFFFFu, static_cast<std::uint32_t>(good.size()),
          static_cast<std::uint32_t>(good.size() - 20)}) {
        auto file = good;
        PutLe32(file, dwgfmt::kImageAddressOffset, address);
        DwgPreview p;
        EXPECT_FALSE(Parse(file, p)) << address;
    }
}

TEST(DwgPreview, DamagedSentinelIsRejected) {
    auto file = Container({{dwgfmt::kBmp, SmallDib()}});
    file[0x40 + 7] ^= 1;
    DwgPreview p;
    EXPECT_FALSE(Parse(file, p));
}

TEST(DwgPreview, EntryOutsideFileOrSectionIsRejected) {
    const auto good = Container({{dwgfmt::kBmp, SmallDib()}});
    const std::size_t entry = 0x40 + dwgfmt::kSectionHeadBytes;
    struct Case {
        std::uint32_t start, size;
    } cases[] = {{0xFFFFFFF0u, 100},
                 {static_cast<std::uint32_t>(good.size() - 10), 100},
                 {0x40 + 30, 0xFFFFFFFFu},
                 {0x40 + 30, 0x7FFFFFFFu},
                 {0, 100},     // inside the file header
                 {0x40, 100}}; // over the entry table
    for (const Case& c : cases) {
        auto file = good;
        PutLe32(file, entry + 1, c.start);
        PutLe32(file, entry + 5, c.size);
        DwgPreview p;
        EXPECT_FALSE(Parse(file, p)) << c.start << " " << c.size;
    }
    auto zero = good;
    PutLe32(zero, entry + 5, 0);
    DwgPreview p;
    EXPECT_FALSE(Parse(zero, p));
}

TEST(DwgPreview, HugeSectionSizeOrCountIsRejected) {
    const auto good = Container({{dwgfmt::kBmp, SmallDib()}});
    auto huge = good;
    PutLe32(huge, 0x40 + 16, 0xFFFFFFFFu);
    DwgPreview p;
    EXPECT_FALSE(Parse(huge, p));
    auto count = good;
    count[0x40 + 20] = 255; // a table running past the section
    EXPECT_FALSE(Parse(count, p));
}

TEST(DwgPreview, DamagedBitmapHeaderIsRejected) {
    const auto dib = SmallDib();
    auto check = [](std::vector<unsigned char> bytes) {
        DwgPreview p;
        return Parse(Container({{dwgfmt::kBmp, bytes}}), p);
    };
    EXPECT_TRUE(check(dib));
    auto bad = dib;
    PutLe32(bad, 0, 12); // header too small
    EXPECT_FALSE(check(bad));
    bad = dib;
    PutLe32(bad, 4, 100000); // wider than the pixels held
    EXPECT_FALSE(check(bad));
    bad = dib;
    PutLe32(bad, 8, 0); // no rows
    EXPECT_FALSE(check(bad));
    bad = dib;
    bad[14] = 7; // bits per pixel
    EXPECT_FALSE(check(bad));
    bad = dib;
    PutLe32(bad, 16, 9); // compression
    EXPECT_FALSE(check(bad));
    bad = dib;
    bad.resize(bad.size() - 1); // one byte of pixels short
    EXPECT_FALSE(check(bad));
    bad = dib;
    PutLe32(bad, 8, static_cast<std::uint32_t>(-8)); // top-down is fine
    DwgPreview p;
    ASSERT_TRUE(Parse(Container({{dwgfmt::kBmp, bad}}), p));
    EXPECT_EQ(p.height, 8);
}

TEST(DwgPreview, PalettedBitmapsAreMeasured) {
    for (int bpp : {4, 8}) {
        DwgPreview p;
        ASSERT_TRUE(Parse(Container({{dwgfmt::kBmp, SmallDib(31, 9, bpp)}}), p)) << bpp;
        EXPECT_EQ(p.width, 31);
        EXPECT_EQ(p.height, 9);
    }
}

TEST(DwgPreview, DamagedPngIsRejected) {
    DwgPreview p;
    auto png = MinimalPng(10, 10);
    png[1] = 'X';
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, png}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(0, 10)}}), p));
    auto shortPng = MinimalPng(10, 10);
    shortPng.resize(20);
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, shortPng}}), p));
}

TEST(DwgPreview, MetafilesWhoseSizesLieAreRejected) {
    DwgPreview p;
    auto parses = [&](const std::vector<unsigned char>& wmf) {
        return Parse(Container({{dwgfmt::kWmf, wmf}}), p);
    };
    // A rectangle between header and end: accepted, also without its end record.
    EXPECT_TRUE(parses(Words({1, 9, 0x0300, 19, 0, 0, 7, 0, 0, 7, 0, 0x041B, 190, 290, 10, 10, 3, 0, 0})));
    EXPECT_TRUE(parses(Words({1, 9, 0x0300, 16, 0, 0, 7, 0, 0, 7, 0, 0x041B, 190, 290, 10, 10})));
    // The total claims more than the bytes present.
    EXPECT_FALSE(parses(Words({1, 9, 0x0300, 0xFFFF, 0xFFFF, 0, 3, 0, 0, 3, 0, 0})));
    // A record that runs past the total, or claims a huge size.
    EXPECT_FALSE(parses(Words({1, 9, 0x0300, 16, 0, 0, 7, 0, 0, 9, 0, 0x041B, 190, 290, 10, 10})));
    EXPECT_FALSE(parses(Words({1, 9, 0x0300, 16, 0, 0, 7, 0, 0, 0xFFFF, 0x7FFF, 0x041B, 190, 290, 10, 10})));
    // A record smaller than its own size and function (which would never advance).
    EXPECT_FALSE(parses(Words({1, 9, 0x0300, 12, 0, 0, 3, 0, 0, 0, 0, 0x041B})));
    EXPECT_FALSE(parses(Words({1, 9, 0x0300, 12, 0, 0, 3, 0, 0, 2, 0, 0x041B})));
    // A header of the wrong size or kind.
    EXPECT_FALSE(parses(Words({1, 7, 0x0300, 12, 0, 0, 3, 0, 0, 3, 0, 0})));
    EXPECT_FALSE(parses(Words({5, 9, 0x0300, 12, 0, 0, 3, 0, 0, 3, 0, 0})));
    EXPECT_FALSE(parses(std::vector<unsigned char>(18, 1)));
}

TEST(DwgPreview, PngBombsAreRejectedFromTheirHeader) {
    DwgPreview p;
    // 16 MiB decoded at most: 2048 x 2048 x 4 bytes is the largest square.
    EXPECT_TRUE(Parse(Container({{dwgfmt::kPng, MinimalPng(2048, 2048)}}), p));
    EXPECT_TRUE(Parse(Container({{dwgfmt::kPng, MinimalPng(4096, 1024)}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(2048, 2049)}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(4096, 4096)}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(4097, 1)}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(1, 100000)}}), p));
    EXPECT_FALSE(Parse(Container({{dwgfmt::kPng, MinimalPng(0x7FFFFFFF, 0x7FFFFFFF)}}), p));
}

TEST(DwgPreview, AnEntryClaimingMoreThanAPreviewIsRejected) {
    std::vector<unsigned char> huge(kMaxPictureBytes + 1, 0);
    const std::vector<unsigned char> dib = SmallDib();
    std::copy(dib.begin(), dib.end(), huge.begin()); // a valid bitmap header, then far too many bytes
    DwgPreview p;
    EXPECT_FALSE(Parse(Container({{dwgfmt::kBmp, huge}}), p));
    huge.resize(kMaxPictureBytes);
    EXPECT_TRUE(Parse(Container({{dwgfmt::kBmp, huge}}), p));
}

TEST(DwgPreview, EveryTruncationIsSafe) {
    const auto file =
        Container({{dwgfmt::kHeader, std::vector<unsigned char>(80)}, {dwgfmt::kBmp, SmallDib()}});
    const std::size_t sectionEnd = file.size() - 16;
    for (std::size_t n = 0; n <= file.size(); ++n) {
        std::vector<unsigned char> cut(file.begin(), file.begin() + static_cast<std::ptrdiff_t>(n));
        DwgPreview p;
        EXPECT_EQ(ParseDwgPreview(cut.data(), cut.size(), p), n >= sectionEnd) << n;
    }
    DwgPreview p;
    EXPECT_FALSE(ParseDwgPreview(nullptr, 0, p));
}

TEST(DwgPreview, FileReadAndDamagedFiles) {
    const std::string dir = TempDir();
    const std::string path = dir + "/orvex-preview-test.dwg";
    const auto file =
        Container({{dwgfmt::kHeader, std::vector<unsigned char>(80)}, {dwgfmt::kBmp, SmallDib()}});
    WriteAll(path, file);
    DwgPreview p;
    ASSERT_TRUE(ReadDwgPreview(path, p));
    EXPECT_EQ(p.bytes, SmallDib());
    for (std::size_t n :
         {std::size_t(0), std::size_t(5), std::size_t(17), std::size_t(0x40 + 10), file.size() - 40}) {
        WriteAll(path,
                 std::vector<unsigned char>(file.begin(), file.begin() + static_cast<std::ptrdiff_t>(n)));
        DwgPreview q;
        EXPECT_FALSE(ReadDwgPreview(path, q)) << n;
    }
    std::remove(path.c_str());
    DwgPreview missing;
    EXPECT_FALSE(ReadDwgPreview(dir + "/orvex-no-such-file.dwg", missing));
}

// --- Drawings of gigabytes ------------------------------------------------------------------------

#ifdef __linux__
// Bytes this process has read so far (the kernel's count of every read call).
std::uint64_t BytesReadSoFar() {
    std::ifstream io("/proc/self/io");
    std::string key;
    std::uint64_t value = 0;
    while (io >> key >> value)
        if (key == "rchar:")
            return value;
    return 0;
}

constexpr std::uint64_t kThreeGiB = 3ull << 30;

// A drawing of 3 GiB whose image section lies at address; everything else is a hole (a sparse file,
// no room taken on disk).
void WriteSparseDrawing(const std::string& path, std::uint64_t address) {
    const std::size_t packed = 0x40;
    const auto small = Container(
        {{dwgfmt::kHeader, std::vector<unsigned char>(80, 1)}, {dwgfmt::kBmp, SmallDib()}}, "AC1018", packed);
    std::vector<unsigned char> header(small.begin(), small.begin() + dwgfmt::kFileHeaderBytes);
    PutLe32(header, dwgfmt::kImageAddressOffset, static_cast<std::uint32_t>(address));
    std::vector<unsigned char> section(small.begin() + packed, small.end());
    const std::size_t count = section[20];
    for (std::size_t i = 0; i < count; ++i) {
        const std::size_t at = dwgfmt::kSectionHeadBytes + i * dwgfmt::kEntryBytes + 1;
        const std::uint32_t start = static_cast<std::uint32_t>(section[at]) | section[at + 1] << 8 |
                                    section[at + 2] << 16 | static_cast<std::uint32_t>(section[at + 3]) << 24;
        PutLe32(section, at, static_cast<std::uint32_t>(start - packed + address));
    }
    WriteAll(path, header);
    std::filesystem::resize_file(path, kThreeGiB);
    std::fstream out(path, std::ios::binary | std::ios::in | std::ios::out);
    out.seekp(static_cast<std::streamoff>(address));
    out.write(reinterpret_cast<const char*>(section.data()), static_cast<std::streamsize>(section.size()));
    ASSERT_TRUE(out.good());
}

TEST(DwgPreview, ADrawingOfThreeGibibytesIsNotReadWhole) {
    const std::string path = TempDir() + "/three-gib.dwg";
    // The image section right behind the header, and near the end of the file.
    for (std::uint64_t address : {std::uint64_t(0x40), kThreeGiB - 4096}) {
        SCOPED_TRACE(address);
        WriteSparseDrawing(path, address);
        ASSERT_EQ(std::filesystem::file_size(path), kThreeGiB);
        const std::uint64_t before = BytesReadSoFar();
        DwgPreview p;
        EXPECT_TRUE(ReadDwgPreview(path, p));
        const std::uint64_t read = BytesReadSoFar() - before;
        EXPECT_EQ(p.kind, DwgPreviewKind::Bmp);
        EXPECT_EQ(p.bytes, SmallDib());
        EXPECT_GT(read, 0u) << "the count of bytes read does not move";
        EXPECT_LT(read, 1u << 20) << "bytes read for the preview of a 3 GiB drawing";
        std::remove(path.c_str());
    }
}

TEST(DwgPreview, AFileOfThreeGibibytesWithoutAHeaderIsNotReadWhole) {
    const std::string path = TempDir() + "/zeros.dwg";
    WriteAll(path, {});
    std::filesystem::resize_file(path, kThreeGiB);
    const std::uint64_t before = BytesReadSoFar();
    DwgPreview p;
    EXPECT_FALSE(ReadDwgPreview(path, p));
    EXPECT_LT(BytesReadSoFar() - before, 1u << 20);
    std::remove(path.c_str());
}
#endif

// --- The sample generator --------------------------------------------------------------------------

TEST(SyntheticDwg, GeneratedFilesReadBack) {
    const std::string dir = TempDir() + "/orvex-gen-test";
    MakeDir(dir);
    dwggen::GenerateOptions options;
    options.outDir = dir;
    options.count = 25;
    options.variant = 7;
    std::string error;
    ASSERT_EQ(dwggen::GenerateSamples(options, error), 25u) << error;
    std::set<std::string> names;
    std::set<std::size_t> sizes;
    std::set<long long> times;
    for (std::uint64_t i = 0; i < options.count; ++i) {
        const std::string name = dwggen::SampleName(i, options.variant);
        names.insert(name);
        const std::string path = dir + "/" + name;
        SCOPED_TRACE(path);
        DwgPreview p;
        ASSERT_TRUE(ReadDwgPreview(path, p));
        EXPECT_EQ(p.kind, DwgPreviewKind::Bmp);
        EXPECT_EQ(p.width, 80);
        EXPECT_EQ(p.height, 60);
        EXPECT_EQ(p.bytes[14], 24);
        struct stat st;
        ASSERT_EQ(stat(path.c_str(), &st), 0);
        EXPECT_GE(st.st_size, 8 * 1024);
        EXPECT_LE(st.st_size, 20 * 1024 + 4096);
        sizes.insert(static_cast<std::size_t>(st.st_size));
        times.insert(static_cast<long long>(st.st_mtime));
        EXPECT_LE(st.st_mtime, options.baseTime);
        std::remove(path.c_str());
    }
    EXPECT_EQ(names.size(), 25u);
    EXPECT_GT(sizes.size(), 10u);
    EXPECT_GT(times.size(), 10u);
}

TEST(SyntheticDwg, PicturesDifferPerSeed) {
    dwggen::PictureOptions picture;
    EXPECT_NE(dwggen::DrawDib(picture, 1), dwggen::DrawDib(picture, 2));
    EXPECT_EQ(dwggen::DrawDib(picture, 3), dwggen::DrawDib(picture, 3));
    picture.width = 180;
    picture.height = 120;
    const auto dib = dwggen::DrawDib(picture, 5);
    EXPECT_EQ(dib.size(), 40u + 180 * 3 * 120);
}

TEST(SyntheticDwg, NamesAreVariedDrawingNames) {
    std::set<std::string> stems;
    bool upperExtension = false;
    for (std::uint64_t i = 0; i < 200; ++i) {
        const std::string name = dwggen::SampleName(i, 1);
        std::string lower = name;
        for (char& c : lower)
            c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        EXPECT_NE(lower.find(".dwg"), std::string::npos) << name;
        upperExtension |= name.find(".DWG") != std::string::npos;
        stems.insert(name.substr(0, name.find('-')));
    }
    EXPECT_TRUE(upperExtension);
    EXPECT_GT(stems.size(), 20u);
}

} // namespace

namespace {

// The fuzzer's seeds stay what their names say.
TEST(DwgPreviewSeeds, SeedsParseAsNamed) {
    const std::string dir = ORVEX_FUZZ_SEEDS;
    struct Variant {
        const char* name;
        DwgPreviewKind kind;
    } seeds[] = {{"bmp24", DwgPreviewKind::Bmp},        {"bmp8", DwgPreviewKind::Bmp},
                 {"bmp4", DwgPreviewKind::Bmp},         {"png", DwgPreviewKind::Png},
                 {"wmf", DwgPreviewKind::Wmf},          {"bmp_wmf", DwgPreviewKind::Bmp},
                 {"r2000_layout", DwgPreviewKind::Bmp}, {"header_only", DwgPreviewKind::None},
                 {"no_entries", DwgPreviewKind::None},  {"pre_r13", DwgPreviewKind::None}};
    for (const Variant& s : seeds) {
        SCOPED_TRACE(s.name);
        const std::string path = dir + "/" + s.name;
        if (!IsDirectory(dir))
            GTEST_SKIP() << "fuzz seeds not found at " << dir;
        DwgPreview p;
        EXPECT_EQ(ReadDwgPreview(path, p), s.kind != DwgPreviewKind::None);
        EXPECT_EQ(p.kind, s.kind);
    }
}

} // namespace
