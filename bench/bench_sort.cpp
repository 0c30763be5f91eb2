// Sorting 100,000 drawing records in each mode: the list's name order (the locale's keys, built once per
// sort, runs of digits by value) next to the byte-wise case-insensitive comparison it replaced and a
// locale comparison asked for every pair.
#include "thumbs/DwgList.h"

#include "BenchClock.h"
#include "SyntheticDwg.h"

#include <algorithm>
#include <clocale>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#ifdef _WIN32
#include <windows.h>
#else
#include <strings.h>
#endif

namespace {

constexpr int kRecords = 100000;
constexpr int kRuns = 5;

std::vector<DwgFindEntry> MakeEntries() {
    std::vector<DwgFindEntry> entries;
    dwggen::Rng rng(99);
    for (int i = 0; i < kRecords; ++i) {
        DwgFindEntry e;
        // Shuffled numbers, so the scan order is not the name order.
        e.name = dwggen::SampleName(rng.Next() % 1000000, 1);
        e.timeWrite = 1500000000 + static_cast<std::int64_t>(rng.Next() % 200000000);
        e.size = static_cast<std::uint64_t>(8000 + rng.Next() % 2000000);
        entries.push_back(e);
    }
    return entries;
}

void Refill(const std::vector<DwgFindEntry>& entries) {
    ScanEntries(entries.data(), static_cast<int>(entries.size()), ".dwg");
}

bool LocaleLess(const DwgData& a, const DwgData& b) {
#ifdef _WIN32
    return CompareStringA(LOCALE_USER_DEFAULT, NORM_IGNORECASE, a.m_strName.c_str(), -1, b.m_strName.c_str(),
                          -1) == CSTR_LESS_THAN;
#else
    return std::strcoll(a.m_strName.c_str(), b.m_strName.c_str()) < 0;
#endif
}

} // namespace

int main() {
    const char* locale = std::setlocale(LC_COLLATE, "");
    if (locale == nullptr || std::strcmp(locale, "C") == 0 || std::strcmp(locale, "POSIX") == 0) {
        const char* tried = std::setlocale(LC_COLLATE, "en_US.UTF-8");
        if (tried == nullptr)
            tried = std::setlocale(LC_COLLATE, "C.UTF-8");
        locale = tried != nullptr ? tried : "C";
    }
    const std::vector<DwgFindEntry> entries = MakeEntries();
    Refill(entries);
    std::printf("bench_sort: %d records (%d kept by the scan filter), median of %d runs\n\n", kRecords,
                DwgList.GetSize(), kRuns);
    std::printf("%-50s %12s\n", "order", "ms");
    std::printf("%-50s %12s\n", "--------------------------------------------------", "------------");

    const char* modes[] = {"SortDwgList by name (locale keys, digits by value)", "SortDwgList by date",
                           "SortDwgList by size"};
    for (int mode = 0; mode < 3; ++mode) {
        std::vector<double> runs;
        for (int r = 0; r < kRuns; ++r) {
            Refill(entries);
            const double t0 = bench::NowMs();
            SortDwgList(mode);
            runs.push_back(bench::NowMs() - t0);
        }
        std::printf("%-50s %12.2f\n", modes[mode], bench::Median(runs));
    }

    std::vector<double> runs;
    for (int r = 0; r < kRuns; ++r) {
        Refill(entries);
        DwgData* first = DwgList.GetData();
        const double t0 = bench::NowMs();
        std::sort(first, first + DwgList.GetSize(), [](const DwgData& a, const DwgData& b) {
            return CompareNamesNoCase(a.m_strName, b.m_strName) < 0;
        });
        runs.push_back(bench::NowMs() - t0);
    }
    std::printf("%-50s %12.2f\n", "name, byte-wise code-page fold (the former sort)", bench::Median(runs));

    runs.clear();
    for (int r = 0; r < kRuns; ++r) {
        Refill(entries);
        DwgData* first = DwgList.GetData();
        const double t0 = bench::NowMs();
        std::sort(first, first + DwgList.GetSize(), LocaleLess);
        runs.push_back(bench::NowMs() - t0);
    }
#ifdef _WIN32
    const char* what = "name, CompareStringA (NORM_IGNORECASE)";
#else
    const char* what = "name, strcoll (locale-aware)";
#endif
    std::printf("%-50s %12.2f\n", what, bench::Median(runs));
#ifndef _WIN32
    runs.clear();
    for (int r = 0; r < kRuns; ++r) {
        Refill(entries);
        DwgData* first = DwgList.GetData();
        const double t0 = bench::NowMs();
        std::sort(first, first + DwgList.GetSize(), [](const DwgData& a, const DwgData& b) {
            return strcasecmp(a.m_strName.c_str(), b.m_strName.c_str()) < 0;
        });
        runs.push_back(bench::NowMs() - t0);
    }
    std::printf("%-50s %12.2f\n", "name, strcasecmp (C library)", bench::Median(runs));
#endif
    std::printf("\ncollation locale for the locale-aware row: %s\n", locale);
    return 0;
}
