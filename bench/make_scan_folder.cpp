// make_scan_folder FOLDER COUNT: writes, natively, the folder of small files bench_scan scans (the same
// names and sizes bench_scan's own MakeFolder writes, and its ".complete" marker). Creating 100,000 files
// through Wine takes the best part of an hour; this takes seconds, and bench_scan then uses the folder.
#include "SyntheticDwg.h"

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <string>

int main(int argc, char** argv) {
    if (argc != 3) {
        std::fprintf(stderr, "usage: make_scan_folder FOLDER COUNT\n");
        return 2;
    }
    const std::string folder = argv[1];
    const int count = std::atoi(argv[2]);
    dwggen::Rng rng(static_cast<std::uint64_t>(count));
    const std::string content(64, 'x');
    for (int i = 0; i < count; ++i) {
        std::string name = dwggen::SampleName(static_cast<std::uint64_t>(i), 7);
        if (i % 10 == 9)
            name += ".bak";
        else if (i % 10 == 8)
            name = "notes-" + std::to_string(i) + ".txt";
        std::ofstream file(folder + "/" + name, std::ios::binary | std::ios::trunc);
        file.write(content.data(), rng.Range(1, 64));
        if (!file) {
            std::fprintf(stderr, "make_scan_folder: cannot write %s/%s\n", folder.c_str(), name.c_str());
            return 1;
        }
    }
    std::ofstream marker(folder + "/.complete", std::ios::binary | std::ios::trunc);
    return marker ? 0 : 1;
}
