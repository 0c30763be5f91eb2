// Reading ini files of growing size: the store's ReadFile against the plain linear search of every
// name it replaced. Linear reading shows as a steady time per thousand keys.
#include "settings/IniFile.h"

#include "BenchClock.h"

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>
#include <utility>
#include <vector>

namespace {

constexpr int kRuns = 5;

// One section of `keys` values, or `keys` sections of one value each.
std::string MakeIni(int keys, bool oneSection) {
    std::string text = oneSection ? "[S]\r\n" : "";
    for (int i = 0; i < keys; ++i) {
        if (!oneSection)
            text += "[S" + std::to_string(i) + "]\r\n";
        text += "k" + std::to_string(i) + "=" + std::to_string(i) + "\r\n";
    }
    return text;
}

// The reading before the index: every line searched its section and name from the start.
int LinearSearchRead(const std::string& text) {
    std::vector<std::pair<std::string, std::vector<std::pair<std::string, std::string>>>> sections;
    std::string section;
    std::size_t pos = 0;
    while (pos < text.size()) {
        std::size_t end = text.find("\r\n", pos);
        std::string line = text.substr(pos, end - pos);
        pos = end + 2;
        if (line.front() == '[') {
            section = line.substr(1, line.size() - 2);
            continue;
        }
        std::size_t eq = line.find('=');
        std::size_t k = 0;
        while (k < sections.size() && sections[k].first != section)
            ++k;
        if (k == sections.size())
            sections.push_back({section, {}});
        auto& values = sections[k].second;
        std::string name = line.substr(0, eq);
        std::size_t j = 0;
        while (j < values.size() && values[j].first != name)
            ++j;
        if (j == values.size())
            values.push_back({name, ""});
        values[j].second = line.substr(eq + 1);
    }
    return static_cast<int>(sections.size());
}

} // namespace

int main() {
    const std::filesystem::path file = std::filesystem::temp_directory_path() / "bench_ini.ini";
    std::printf("bench_ini: reading an ini file, median of %d runs (ms)\n\n", kRuns);
    std::printf("%-13s %8s %10s %12s %14s %14s\n", "layout", "keys", "bytes", "ReadFile", "per 1000 keys",
                "linear search");
    std::printf("%-13s %8s %10s %12s %14s %14s\n", "-------------", "--------", "----------", "------------",
                "--------------", "--------------");
    for (bool oneSection : {true, false}) {
        for (int keys : {1000, 4000, 16000, 64000}) {
            const std::string text = MakeIni(keys, oneSection);
            if (text.size() > kMaxIniFileBytes)
                continue;
            std::ofstream(file, std::ios::binary) << text;
            std::vector<double> reads, linear;
            for (int run = 0; run < kRuns; ++run) {
                CIniFile ini(file.string());
                double start = bench::NowMs();
                ini.ReadFile();
                reads.push_back(bench::NowMs() - start);
                // The old way is quadratic: measured only while it stays short.
                if (keys <= 16000) {
                    start = bench::NowMs();
                    LinearSearchRead(text);
                    linear.push_back(bench::NowMs() - start);
                }
            }
            const double read = bench::Median(reads);
            char linearText[32] = "(skipped)";
            if (!linear.empty())
                std::snprintf(linearText, sizeof linearText, "%.2f", bench::Median(linear));
            std::printf("%-13s %8d %10zu %12.2f %14.3f %14s\n", oneSection ? "one section" : "one per key",
                        keys, text.size(), read, read * 1000.0 / keys, linearText);
        }
    }
    std::filesystem::remove(file);
    return 0;
}
