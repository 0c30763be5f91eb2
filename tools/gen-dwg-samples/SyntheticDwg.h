// Synthetic drawing files for tests and benchmarks. They are NOT drawings: each has only the container
// layout a preview reader looks at (release magic, the image section address at 0x0D, the image
// section with a header entry and a bitmap entry, its end sentinel) and filler bytes, and the bitmap is
// a picture drawn here from a variant (lines, boxes and circles on a tinted background).
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace dwggen {

struct PictureOptions {
    int width = 80;
    int height = 60;
    int bitsPerPixel = 24; // 24, 8 or 4
};

// A bottom-up DIB (BITMAPINFOHEADER, palette when paletted, pixels) of a picture drawn from variant.
std::vector<unsigned char> DrawDib(const PictureOptions& picture, std::uint64_t variant);

// A whole synthetic drawing file around one DIB; fillerBytes of padding follow the image section so
// that files differ in size.
std::vector<unsigned char> BuildDwg(const std::vector<unsigned char>& dib, std::size_t fillerBytes,
                                    std::uint64_t variant);
// The same around a picture of another kind (entry code 2 bitmap, 3 metafile, 6 PNG).
std::vector<unsigned char> BuildDwgWithPicture(unsigned char code, const std::vector<unsigned char>& picture,
                                               std::size_t fillerBytes, std::uint64_t variant);

// File name of sample number index: varied words, mixed case, mostly ".dwg" in either case.
std::string SampleName(std::uint64_t index, std::uint64_t variant);

// Small deterministic generator, enough to vary the samples.
class Rng {
public:
    explicit Rng(std::uint64_t variant) : m_state(variant * 0x9E3779B97F4A7C15ull + 0x632BE59BD9B4E019ull) {}
    std::uint64_t Next() {
        std::uint64_t z = (m_state += 0x9E3779B97F4A7C15ull);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
        return z ^ (z >> 31);
    }
    // Uniform in lo..hi inclusive.
    int Range(int lo, int hi) {
        return lo + static_cast<int>(Next() % static_cast<std::uint64_t>(hi - lo + 1));
    }

private:
    std::uint64_t m_state;
};

struct GenerateOptions {
    std::string outDir;
    std::uint64_t count = 0;
    std::uint64_t variant = 1;
    PictureOptions picture;
    bool lowerCase = false; // names all in lower case (else mixed, as SampleName makes them)
    // Modification times are spread over this many seconds before baseTime.
    std::int64_t baseTime = 1700000000;
    std::int64_t timeSpread = 5LL * 365 * 24 * 3600;
};

// Writes count files into outDir (which must exist). Returns the number written; error receives the
// first failure.
std::uint64_t GenerateSamples(const GenerateOptions& options, std::string& error);

} // namespace dwggen
