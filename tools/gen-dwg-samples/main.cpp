// gen-dwg-samples OUTDIR COUNT [--variant N] [--width W] [--height H] [--bpp 24|8|4] [--lower-case]
// Writes COUNT synthetic drawing files (container layout and preview picture only, no drawing content)
// into OUTDIR, for tests and benchmarks of the thumbnail browser. Their names mix upper and lower case;
// with --lower-case they are all lower case (the same names otherwise).
#include "SyntheticDwg.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

int Usage() {
    std::fprintf(stderr,
                 "usage: gen-dwg-samples OUTDIR COUNT [--variant N] [--width W] [--height H] [--bpp 24|8|4] "
                 "[--lower-case]\n");
    return 2;
}

bool ParseNumber(const char* text, unsigned long long& value) {
    char* end = nullptr;
    value = std::strtoull(text, &end, 10);
    return end != text && *end == '\0';
}

} // namespace

int main(int argc, char** argv) {
    if (argc < 3)
        return Usage();
    dwggen::GenerateOptions options;
    options.outDir = argv[1];
    unsigned long long value = 0;
    if (!ParseNumber(argv[2], value))
        return Usage();
    options.count = value;
    for (int i = 3; i < argc; ++i) {
        const char* flag = argv[i];
        if (std::strcmp(flag, "--lower-case") == 0) {
            options.lowerCase = true;
            continue;
        }
        if (i + 1 >= argc || !ParseNumber(argv[i + 1], value))
            return Usage();
        ++i;
        if (std::strcmp(flag, "--variant") == 0)
            options.variant = value;
        else if (std::strcmp(flag, "--width") == 0 && value > 0 && value <= 4096)
            options.picture.width = static_cast<int>(value);
        else if (std::strcmp(flag, "--height") == 0 && value > 0 && value <= 4096)
            options.picture.height = static_cast<int>(value);
        else if (std::strcmp(flag, "--bpp") == 0 && (value == 24 || value == 8 || value == 4))
            options.picture.bitsPerPixel = static_cast<int>(value);
        else
            return Usage();
    }
    std::string error;
    const unsigned long long written = dwggen::GenerateSamples(options, error);
    if (written != options.count) {
        std::fprintf(stderr, "gen-dwg-samples: %s\n", error.c_str());
        return 1;
    }
    std::printf("%llu files written to %s\n", written, options.outDir.c_str());
    return 0;
}
