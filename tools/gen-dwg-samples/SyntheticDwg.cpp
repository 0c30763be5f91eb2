#include "SyntheticDwg.h"

#include "preview/DwgPreview.h"

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstring>
#include <memory>

#ifdef _WIN32
#include <sys/utime.h>
#else
#include <utime.h>
#endif

namespace dwggen {
namespace {

void PutLe32(unsigned char* p, std::uint32_t v) {
    p[0] = static_cast<unsigned char>(v);
    p[1] = static_cast<unsigned char>(v >> 8);
    p[2] = static_cast<unsigned char>(v >> 16);
    p[3] = static_cast<unsigned char>(v >> 24);
}
void PutLe16(unsigned char* p, std::uint16_t v) {
    p[0] = static_cast<unsigned char>(v);
    p[1] = static_cast<unsigned char>(v >> 8);
}

struct Rgb {
    unsigned char r, g, b;
};

// The 16 colours of the 4-bit pictures; the 8-bit ones use a 6x6x6 cube.
const Rgb kBasic16[16] = {{0, 0, 0},       {128, 0, 0},   {0, 128, 0},   {128, 128, 0},
                          {0, 0, 128},     {128, 0, 128}, {0, 128, 128}, {192, 192, 192},
                          {128, 128, 128}, {255, 0, 0},   {0, 255, 0},   {255, 255, 0},
                          {0, 0, 255},     {255, 0, 255}, {0, 255, 255}, {255, 255, 255}};

// A picture being drawn, stored as colours, written out as a DIB at the end.
class Canvas {
public:
    Canvas(int width, int height, Rgb background)
        : m_width(width), m_height(height), m_pixels(static_cast<std::size_t>(width) * height, background) {}

    void Plot(int x, int y, Rgb c) {
        if (x >= 0 && y >= 0 && x < m_width && y < m_height)
            m_pixels[static_cast<std::size_t>(y) * m_width + x] = c;
    }
    void Line(int x0, int y0, int x1, int y1, Rgb c) {
        const int dx = std::abs(x1 - x0), sx = x0 < x1 ? 1 : -1;
        const int dy = -std::abs(y1 - y0), sy = y0 < y1 ? 1 : -1;
        int err = dx + dy;
        for (;;) {
            Plot(x0, y0, c);
            if (x0 == x1 && y0 == y1)
                break;
            const int e2 = 2 * err;
            if (e2 >= dy) {
                err += dy;
                x0 += sx;
            }
            if (e2 <= dx) {
                err += dx;
                y0 += sy;
            }
        }
    }
    void Box(int x0, int y0, int x1, int y1, Rgb c, bool filled) {
        if (x0 > x1)
            std::swap(x0, x1);
        if (y0 > y1)
            std::swap(y0, y1);
        for (int y = y0; y <= y1; ++y)
            for (int x = x0; x <= x1; ++x)
                if (filled || y == y0 || y == y1 || x == x0 || x == x1)
                    Plot(x, y, c);
    }
    void Circle(int cx, int cy, int r, Rgb c, bool filled) {
        for (int y = -r; y <= r; ++y)
            for (int x = -r; x <= r; ++x) {
                const int d = x * x + y * y;
                if (d <= r * r && (filled || d >= (r - 1) * (r - 1)))
                    Plot(cx + x, cy + y, c);
            }
    }
    Rgb At(int x, int y) const { return m_pixels[static_cast<std::size_t>(y) * m_width + x]; }

private:
    int m_width;
    int m_height;
    std::vector<Rgb> m_pixels;
};

Rgb RandomColour(Rng& rng) {
    return {static_cast<unsigned char>(rng.Range(0, 255)), static_cast<unsigned char>(rng.Range(0, 255)),
            static_cast<unsigned char>(rng.Range(0, 255))};
}

unsigned NearestBasic(Rgb c) {
    unsigned best = 0;
    int bestDistance = 1 << 30;
    for (unsigned i = 0; i < 16; ++i) {
        const int dr = c.r - kBasic16[i].r, dg = c.g - kBasic16[i].g, db = c.b - kBasic16[i].b;
        const int d = dr * dr + dg * dg + db * db;
        if (d < bestDistance) {
            bestDistance = d;
            best = i;
        }
    }
    return best;
}

unsigned CubeIndex(Rgb c) {
    return (c.r * 6 / 256) * 36 + (c.g * 6 / 256) * 6 + (c.b * 6 / 256);
}

} // namespace

std::vector<unsigned char> DrawDib(const PictureOptions& picture, std::uint64_t variant) {
    Rng rng(variant);
    const int w = std::max(1, picture.width);
    const int h = std::max(1, picture.height);
    const int bits = (picture.bitsPerPixel == 4 || picture.bitsPerPixel == 8) ? picture.bitsPerPixel : 24;

    // A light tinted background, then a frame, a few shapes and lines across.
    const Rgb background{static_cast<unsigned char>(rng.Range(200, 255)),
                         static_cast<unsigned char>(rng.Range(200, 255)),
                         static_cast<unsigned char>(rng.Range(200, 255))};
    Canvas canvas(w, h, background);
    canvas.Box(0, 0, w - 1, h - 1, Rgb{0, 0, 0}, false);
    const int shapes = rng.Range(2, 6);
    for (int i = 0; i < shapes; ++i) {
        const Rgb c = RandomColour(rng);
        switch (rng.Range(0, 3)) {
        case 0:
            canvas.Box(rng.Range(0, w - 1), rng.Range(0, h - 1), rng.Range(0, w - 1), rng.Range(0, h - 1), c,
                       rng.Range(0, 1) == 1);
            break;
        case 1:
            canvas.Circle(rng.Range(0, w - 1), rng.Range(0, h - 1),
                          rng.Range(2, std::max(3, std::min(w, h) / 3)), c, rng.Range(0, 1) == 1);
            break;
        default:
            canvas.Line(rng.Range(0, w - 1), rng.Range(0, h - 1), rng.Range(0, w - 1), rng.Range(0, h - 1),
                        c);
            break;
        }
    }
    // A diagonal hatch so that every picture has detail in its middle.
    const Rgb hatch = RandomColour(rng);
    for (int k = -h; k < w; k += rng.Range(6, 14))
        canvas.Line(k, 0, k + h, h - 1, hatch);

    const std::size_t colours = bits == 24 ? 0 : (1u << bits);
    const std::size_t stride = ((static_cast<std::size_t>(w) * bits + 31) / 32) * 4;
    const std::size_t pixelBytes = stride * h;
    std::vector<unsigned char> dib(40 + colours * 4 + pixelBytes, 0);
    unsigned char* p = dib.data();
    PutLe32(p, 40);
    PutLe32(p + 4, static_cast<std::uint32_t>(w));
    PutLe32(p + 8, static_cast<std::uint32_t>(h));
    PutLe16(p + 12, 1);
    PutLe16(p + 14, static_cast<std::uint16_t>(bits));
    PutLe32(p + 16, 0); // BI_RGB
    PutLe32(p + 20, static_cast<std::uint32_t>(pixelBytes));
    PutLe32(p + 32, static_cast<std::uint32_t>(colours));
    unsigned char* palette = p + 40;
    for (std::size_t i = 0; i < colours; ++i) {
        Rgb c = bits == 4 ? kBasic16[i]
                          : Rgb{static_cast<unsigned char>((i / 36 % 6) * 51),
                                static_cast<unsigned char>((i / 6 % 6) * 51),
                                static_cast<unsigned char>((i % 6) * 51)};
        palette[i * 4] = c.b;
        palette[i * 4 + 1] = c.g;
        palette[i * 4 + 2] = c.r;
    }
    unsigned char* pixels = palette + colours * 4;
    for (int y = 0; y < h; ++y) {
        unsigned char* row = pixels + static_cast<std::size_t>(h - 1 - y) * stride; // bottom-up
        for (int x = 0; x < w; ++x) {
            const Rgb c = canvas.At(x, y);
            if (bits == 24) {
                row[x * 3] = c.b;
                row[x * 3 + 1] = c.g;
                row[x * 3 + 2] = c.r;
            } else if (bits == 8) {
                row[x] = static_cast<unsigned char>(CubeIndex(c));
            } else {
                const unsigned v = NearestBasic(c);
                row[x / 2] |= static_cast<unsigned char>((x % 2) == 0 ? v << 4 : v);
            }
        }
    }
    return dib;
}

std::vector<unsigned char> BuildDwg(const std::vector<unsigned char>& dib, std::size_t fillerBytes,
                                    std::uint64_t variant) {
    return BuildDwgWithPicture(dwgfmt::kBmp, dib, fillerBytes, variant);
}

std::vector<unsigned char> BuildDwgWithPicture(unsigned char code, const std::vector<unsigned char>& dib,
                                               std::size_t fillerBytes, std::uint64_t variant) {
    constexpr std::size_t kSectionAddress = 0x1C0;
    constexpr std::size_t kHeaderDataBytes = 80;
    constexpr unsigned kEntries = 2;
    const std::size_t table = dwgfmt::kSectionHeadBytes + kEntries * dwgfmt::kEntryBytes;
    const std::size_t headerStart = kSectionAddress + table;
    const std::size_t dibStart = headerStart + kHeaderDataBytes;
    const std::size_t sectionEnd = dibStart + dib.size();
    std::vector<unsigned char> file(sectionEnd + 16 + fillerBytes, 0);
    unsigned char* p = file.data();

    Rng rng(variant ^ 0xD1B54A32D192ED03ull);
    std::memcpy(p, "AC1018", 6);
    for (std::size_t i = 6; i < kSectionAddress; ++i)
        p[i] = static_cast<unsigned char>(rng.Next());
    PutLe32(p + dwgfmt::kImageAddressOffset, static_cast<std::uint32_t>(kSectionAddress));

    unsigned char* s = p + kSectionAddress;
    std::memcpy(s, dwgfmt::kImageSentinel, sizeof dwgfmt::kImageSentinel);
    // The size counts from the entry count to the end of the last picture.
    PutLe32(s + 16, static_cast<std::uint32_t>(sectionEnd - (kSectionAddress + 20)));
    s[20] = kEntries;
    unsigned char* e = s + dwgfmt::kSectionHeadBytes;
    e[0] = dwgfmt::kHeader;
    PutLe32(e + 1, static_cast<std::uint32_t>(headerStart));
    PutLe32(e + 5, static_cast<std::uint32_t>(kHeaderDataBytes));
    e += dwgfmt::kEntryBytes;
    e[0] = code;
    PutLe32(e + 1, static_cast<std::uint32_t>(dibStart));
    PutLe32(e + 5, static_cast<std::uint32_t>(dib.size()));
    for (std::size_t i = 0; i < kHeaderDataBytes; ++i)
        p[headerStart + i] = static_cast<unsigned char>(rng.Next());
    std::memcpy(p + dibStart, dib.data(), dib.size());
    for (std::size_t i = 0; i < 16; ++i)
        p[sectionEnd + i] = static_cast<unsigned char>(~dwgfmt::kImageSentinel[i]);
    for (std::size_t i = sectionEnd + 16; i < file.size(); i += 8) {
        const std::uint64_t v = rng.Next();
        std::memcpy(p + i, &v, std::min<std::size_t>(8, file.size() - i));
    }
    return file;
}

std::string SampleName(std::uint64_t index, std::uint64_t variant) {
    static const char* const kWords[] = {
        "Plan", "floor", "SECTION", "detail", "Elevation", "site",   "roof",    "Stair", "door",  "WINDOW",
        "wall", "Beam",  "column",  "slab",   "Facade",    "garden", "Kitchen", "bath",  "Lobby", "Garage"};
    static const char* const kExtensions[] = {".dwg", ".dwg", ".dwg", ".DWG", ".Dwg", ".dwg"};
    Rng rng(variant * 31 + index);
    const std::size_t words = sizeof kWords / sizeof kWords[0];
    std::string name = kWords[rng.Next() % words];
    if (rng.Range(0, 2) == 0) {
        name += rng.Range(0, 1) ? "_" : " ";
        name += kWords[rng.Next() % words];
    }
    char number[32];
    std::snprintf(number, sizeof number, "-%06llu", static_cast<unsigned long long>(index));
    name += number;
    name += kExtensions[rng.Next() % (sizeof kExtensions / sizeof kExtensions[0])];
    return name;
}

std::uint64_t GenerateSamples(const GenerateOptions& options, std::string& error) {
    std::uint64_t written = 0;
    std::string path = options.outDir;
    if (!path.empty() && path.back() != '/' && path.back() != '\\')
        path += '/';
    const std::size_t dirLength = path.size();
    const std::size_t baseSize = DrawDib(options.picture, 0).size();
    // Files between about 8 KB and 20 KB, or a little above the picture when the picture is larger.
    const std::size_t smallest = std::max<std::size_t>(8 * 1024, baseSize + 1024);
    const std::size_t largest = std::max<std::size_t>(20 * 1024, smallest + 4096);
    for (std::uint64_t i = 0; i < options.count; ++i) {
        Rng rng(options.variant * 1000003ull + i);
        const std::uint64_t pictureSeed = rng.Next();
        const std::vector<unsigned char> dib = DrawDib(options.picture, pictureSeed);
        const std::size_t target = smallest + rng.Next() % (largest - smallest + 1);
        const std::size_t core =
            0x1C0 + dwgfmt::kSectionHeadBytes + 2 * dwgfmt::kEntryBytes + 80 + dib.size() + 16;
        const std::vector<unsigned char> file = BuildDwg(dib, target > core ? target - core : 0, rng.Next());

        path.resize(dirLength);
        std::string name = SampleName(i, options.variant);
        if (options.lowerCase)
            for (char& c : name)
                c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
        path += name;
        std::FILE* f = std::fopen(path.c_str(), "wb");
        if (f == nullptr) {
            error = "cannot create " + path;
            return written;
        }
        const bool ok = std::fwrite(file.data(), 1, file.size(), f) == file.size();
        if (std::fclose(f) != 0 || !ok) {
            error = "cannot write " + path;
            return written;
        }
        const std::int64_t when =
            options.baseTime -
            static_cast<std::int64_t>(
                rng.Next() % static_cast<std::uint64_t>(std::max<std::int64_t>(1, options.timeSpread)));
#ifdef _WIN32
        struct _utimbuf times;
        times.actime = static_cast<time_t>(when);
        times.modtime = static_cast<time_t>(when);
        _utime(path.c_str(), &times);
#else
        struct utimbuf times;
        times.actime = static_cast<time_t>(when);
        times.modtime = static_cast<time_t>(when);
        utime(path.c_str(), &times);
#endif
        ++written;
    }
    return written;
}

} // namespace dwggen
