// Showing folders of 10,000 and 100,000 files with DrawingFolder::Show against a bare FindFirstFileA loop
// over the same folder (the narrow search the scan used before), and against a bare loop of the wide
// search the scan uses now (FindFirstFileExW, basic information, large fetch). A folder whose scan takes
// longer than the quick wait goes on on the scan's thread: Show's time runs until its list is filled.
// The folders are made here (small files, mostly drawing names) on first run.
#include "thumbs/DrawingFolder.h"

#include "BenchClock.h"
#include "SyntheticDwg.h"

#include <windows.h>

#include <cstdio>
#include <string>
#include <vector>

namespace {

// Creates count small files in folder unless it already holds them.
bool MakeFolder(const std::string& folder, int count) {
    CreateDirectoryA(folder.c_str(), nullptr);
    const std::string marker = folder + "\\.complete";
    if (GetFileAttributesA(marker.c_str()) != INVALID_FILE_ATTRIBUTES)
        return true;
    dwggen::Rng rng(static_cast<std::uint64_t>(count));
    std::string content(64, 'x');
    for (int i = 0; i < count; ++i) {
        std::string name = dwggen::SampleName(static_cast<std::uint64_t>(i), 7);
        if (i % 10 == 9)
            name += ".bak"; // still taken: the needle is a substring
        else if (i % 10 == 8)
            name = "notes-" + std::to_string(i) + ".txt";
        const std::string path = folder + "\\" + name;
        HANDLE h = CreateFileA(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL,
                               nullptr);
        if (h == INVALID_HANDLE_VALUE)
            return false;
        DWORD written = 0;
        WriteFile(h, content.data(), static_cast<DWORD>(rng.Range(1, 64)), &written, nullptr);
        CloseHandle(h);
    }
    HANDLE m =
        CreateFileA(marker.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr);
    CloseHandle(m);
    return true;
}

int BareLoop(const std::string& folder) {
    WIN32_FIND_DATAA found;
    HANDLE h = FindFirstFileA((folder + "\\*").c_str(), &found);
    if (h == INVALID_HANDLE_VALUE)
        return 0;
    int n = 0;
    do {
        ++n;
    } while (FindNextFileA(h, &found));
    FindClose(h);
    return n;
}

int BareWideLoop(const std::string& folder) {
    WIN32_FIND_DATAW found;
    const std::wstring pattern(folder.begin(), folder.end()); // the bench's folders are plain ASCII
    HANDLE h = FindFirstFileExW((pattern + L"\\*").c_str(), FindExInfoBasic, &found, FindExSearchNameMatch,
                                nullptr, FIND_FIRST_EX_LARGE_FETCH);
    if (h == INVALID_HANDLE_VALUE)
        return 0;
    int n = 0;
    do {
        ++n;
    } while (FindNextFileW(h, &found));
    FindClose(h);
    return n;
}

// Show, and the wait for a scan that went on on its thread, as the frame's timer takes it.
void ShowWhole(DrawingFolder& shown, const std::string& folder) {
    shown.Show(folder);
    while (shown.IsScanning() && !shown.TakeEndedScan())
        Sleep(1);
}

} // namespace

int main(int argc, char** argv) {
    const std::string root = argc > 1 ? argv[1] : "bench-scan-folders";
    CreateDirectoryA(root.c_str(), nullptr);
    char full[MAX_PATH];
    GetFullPathNameA(root.c_str(), MAX_PATH, full, nullptr);
    const std::string base = full;
    const int runs = 5;
    std::printf("bench_scan: median of %d runs (ms)\n\n", runs);
    std::printf("%10s %10s %16s %16s %8s %16s %8s\n", "files", "records", "Show", "FindFirstFileA", "ratio",
                "FindFirstFileExW", "ratio");
    std::printf("%10s %10s %16s %16s %8s %16s %8s\n", "----------", "----------", "----------------",
                "----------------", "--------", "----------------", "--------");
    for (int count : {10000, 100000}) {
        const std::string folder = base + "\\files-" + std::to_string(count);
        const double t0 = bench::NowMs();
        if (!MakeFolder(folder, count)) {
            std::printf("cannot create the files in %s\n", folder.c_str());
            return 1;
        }
        const double made = bench::NowMs() - t0;
        std::vector<double> scan, bare, wide;
        int records = 0;
        FileSystemFolderReader reader;
        DrawingFolder shown(reader, nullptr);
        for (int r = 0; r < runs; ++r) {
            double t = bench::NowMs();
            ShowWhole(shown, folder);
            scan.push_back(bench::NowMs() - t);
            records = shown.Count();
            t = bench::NowMs();
            BareLoop(folder);
            bare.push_back(bench::NowMs() - t);
            t = bench::NowMs();
            BareWideLoop(folder);
            wide.push_back(bench::NowMs() - t);
        }
        const double s = bench::Median(scan), b = bench::Median(bare), w = bench::Median(wide);
        std::printf("%10d %10d %16.2f %16.2f %8.2f %16.2f %8.2f   (folder made in %.0f ms)\n", count, records,
                    s, b, s / b, w, s / w, made);
        SetCurrentDirectoryA(base.c_str());
    }
    return 0;
}
