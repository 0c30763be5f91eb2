// Reading one drawing's preview against reading the same bytes raw (one seek and one read of exactly
// the picture), averaged over every sample drawing that has a preview, and over synthetic drawings.
#include "preview/DwgPreview.h"

#include "BenchClock.h"
#include "SyntheticDwg.h"

#include <sys/stat.h>

#include <cstdio>
#include <fstream>
#include <string>
#include <vector>

#ifdef _WIN32
#include <direct.h>
#endif

namespace {

struct Sample {
    std::string path;
    std::size_t start = 0; // where the picture lies, found once beforehand
    std::size_t size = 0;
};

// Finds the picture's place by searching the file for the bytes the reader returned.
bool Locate(Sample& s) {
    DwgPreview p;
    if (!ReadDwgPreview(s.path, p))
        return false;
    std::ifstream in(s.path, std::ios::binary);
    std::vector<unsigned char> all((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    for (std::size_t i = 0; i + p.bytes.size() <= all.size(); ++i) {
        if (all[i] == p.bytes[0] &&
            std::equal(p.bytes.begin(), p.bytes.end(), all.begin() + static_cast<std::ptrdiff_t>(i))) {
            s.start = i;
            s.size = p.bytes.size();
            return true;
        }
    }
    return false;
}

bool RawRead(const Sample& s, std::vector<unsigned char>& buffer) {
    std::FILE* f = std::fopen(s.path.c_str(), "rb");
    if (f == nullptr)
        return false;
    buffer.resize(s.size);
    const bool ok = std::fseek(f, static_cast<long>(s.start), SEEK_SET) == 0 &&
                    std::fread(buffer.data(), 1, buffer.size(), f) == buffer.size();
    std::fclose(f);
    return ok;
}

bool WholeRead(const Sample& s, std::vector<unsigned char>& buffer) {
    std::FILE* f = std::fopen(s.path.c_str(), "rb");
    if (f == nullptr)
        return false;
    std::fseek(f, 0, SEEK_END);
    buffer.resize(static_cast<std::size_t>(std::ftell(f)));
    std::fseek(f, 0, SEEK_SET);
    const bool ok = std::fread(buffer.data(), 1, buffer.size(), f) == buffer.size();
    std::fclose(f);
    return ok;
}

void Row(const char* set, const std::vector<Sample>& samples, int rounds) {
    if (samples.empty()) {
        std::printf("%-22s %8s   (no files)\n", set, "0");
        return;
    }
    double tPreview = 0, tRaw = 0, tWhole = 0;
    std::size_t bytes = 0;
    std::vector<unsigned char> buffer;
    for (int r = 0; r < rounds; ++r) {
        for (const Sample& s : samples) {
            DwgPreview p;
            double t0 = bench::NowMs();
            ReadDwgPreview(s.path, p);
            tPreview += bench::NowMs() - t0;
            t0 = bench::NowMs();
            RawRead(s, buffer);
            tRaw += bench::NowMs() - t0;
            t0 = bench::NowMs();
            WholeRead(s, buffer);
            tWhole += bench::NowMs() - t0;
            bytes += p.bytes.size();
        }
    }
    const double n = static_cast<double>(samples.size()) * rounds;
    std::printf("%-22s %8zu %10.0f %14.2f %14.2f %10.2f %14.2f\n", set, samples.size(), bytes / n,
                tPreview * 1000 / n, tRaw * 1000 / n, tPreview / tRaw, tWhole * 1000 / n);
}

} // namespace

int main() {
    const std::string samplesDir = ORVEX_SAMPLES_DIR;
    std::vector<Sample> real;
    std::ifstream manifest(samplesDir + "/MANIFEST.csv");
    std::string line;
    std::getline(manifest, line);
    while (std::getline(manifest, line)) {
        Sample s;
        s.path = samplesDir + "/" + line.substr(0, line.find(','));
        if (Locate(s))
            real.push_back(s);
    }

    const std::string genDir = "bench-preview-samples";
#ifdef _WIN32
    _mkdir(genDir.c_str());
#else
    mkdir(genDir.c_str(), 0755);
#endif
    dwggen::GenerateOptions options;
    options.outDir = genDir;
    options.count = 200;
    std::string error;
    dwggen::GenerateSamples(options, error);
    std::vector<Sample> synthetic;
    for (std::uint64_t i = 0; i < options.count; ++i) {
        Sample s;
        s.path = genDir + "/" + dwggen::SampleName(i, options.variant);
        if (Locate(s))
            synthetic.push_back(s);
    }

    const int rounds = 50;
    std::printf("bench_preview: per file, averaged over %d rounds (times in microseconds)\n\n", rounds);
    std::printf("%-22s %8s %10s %14s %14s %10s %14s\n", "files", "count", "bytes", "ReadDwgPreview",
                "raw read", "ratio", "whole file");
    std::printf("%-22s %8s %10s %14s %14s %10s %14s\n", "----------------------", "--------", "----------",
                "--------------", "--------------", "----------", "--------------");
    Row("dwg-samples (real)", real, rounds);
    Row("synthetic (generated)", synthetic, rounds);
    if (real.empty())
        std::printf("\n(the sample drawings were not found at %s)\n", samplesDir.c_str());
    return 0;
}
