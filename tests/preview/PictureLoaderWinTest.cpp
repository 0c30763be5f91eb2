// The picture loader under Wine: pictures decoded by its workers look as the host's drawing of them,
// arrive through the loader's window, are read once, and the loader's end neither waits for a read that
// never returns nor leaves threads, handles or GDI objects behind.
#include "preview/PictureLoader.h"

#include "preview/DrawPreview.h"

#include "SyntheticDwg.h"
#include "tests/support/MessagePump.h"
#include "tests/support/ProcessResources.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

namespace {

using testsupport::TempFolder;

const COLORREF kBackground = RGB(1, 2, 3);

std::string WriteDrawing(const TempFolder& folder, const std::string& name, std::uint64_t variant) {
    dwggen::PictureOptions options;
    options.width = 160;
    options.height = 100;
    const std::vector<unsigned char> dwg = dwggen::BuildDwg(dwggen::DrawDib(options, variant), 100, variant);
    return folder.Write(name, std::string(dwg.begin(), dwg.end()));
}

PictureKey KeyOf(const std::string& path, int width = 150, int height = 120) {
    PictureKey key;
    key.path = path;
    key.fileSize = 1;
    key.writeTime = 2;
    key.width = width;
    key.height = height;
    key.background = kBackground;
    return key;
}

// The host's drawing of the file into a memory DC the size of the key.
std::vector<std::uint32_t> HostDrawing(const PictureKey& key) {
    HDC dc = CreateCompatibleDC(nullptr);
    BITMAPINFO info{};
    info.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
    info.bmiHeader.biWidth = key.width;
    info.bmiHeader.biHeight = -key.height;
    info.bmiHeader.biPlanes = 1;
    info.bmiHeader.biBitCount = 32;
    info.bmiHeader.biCompression = BI_RGB;
    void* bits = nullptr;
    HBITMAP bitmap = CreateDIBSection(dc, &info, DIB_RGB_COLORS, &bits, nullptr, 0);
    HGDIOBJ old = SelectObject(dc, bitmap);
    const RECT area{0, 0, key.width, key.height};
    const std::wstring path(key.path.begin(), key.path.end());
    DrawDwgPreview(dc, area, path.c_str(), kBackground);
    GdiFlush();
    const auto* pixels = static_cast<const std::uint32_t*>(bits);
    std::vector<std::uint32_t> copy(pixels, pixels + static_cast<std::size_t>(key.width) * key.height);
    SelectObject(dc, old);
    DeleteObject(bitmap);
    DeleteDC(dc);
    return copy;
}

bool AllArrived(PictureLoader& loader, const std::vector<PictureKey>& keys) {
    for (const PictureKey& key : keys)
        if (!loader.Find(key))
            return false;
    return true;
}

TEST(DecodePicture, IsThePictureTheHostDraws) {
    TempFolder folder("orvex-loader");
    for (int variant = 1; variant <= 3; ++variant) {
        const PictureKey key = KeyOf(WriteDrawing(folder, "d" + std::to_string(variant) + ".dwg", variant),
                                     100 + 40 * variant, 140 - 20 * variant);
        const Picture picture = DecodePicture(key);
        EXPECT_EQ(picture.state, PictureState::Drawn);
        ASSERT_EQ(picture.width, key.width);
        ASSERT_EQ(picture.height, key.height);
        const std::vector<std::uint32_t> host = HostDrawing(key);
        ASSERT_EQ(picture.pixels.size(), host.size());
        std::size_t differ = 0;
        for (std::size_t i = 0; i < host.size(); ++i)
            if ((picture.pixels[i] & 0xFFFFFF) != (host[i] & 0xFFFFFF))
                ++differ;
        EXPECT_EQ(differ, 0u) << "variant " << variant;
    }
}

TEST(DecodePicture, AFileWithoutAPreviewGivesTheNoPreviewMark) {
    TempFolder folder("orvex-loader");
    const PictureKey key = KeyOf(folder.Write("empty.dwg", "AC1015 no picture in here at all"));
    const Picture picture = DecodePicture(key);
    EXPECT_EQ(picture.state, PictureState::NoPreview);
    EXPECT_EQ(picture.pixels, HostDrawing(key)) << "the background and the host's no-preview mark";
    EXPECT_EQ(DecodePicture(KeyOf(folder.File("missing.dwg"))).state, PictureState::NoPreview);
}

TEST(PictureLoader, PicturesArriveThroughItsWindowAndAreReadOnce) {
    TempFolder folder("orvex-loader");
    std::vector<PictureKey> keys;
    for (int i = 0; i < 12; ++i)
        keys.push_back(KeyOf(WriteDrawing(folder, "p" + std::to_string(i) + ".dwg", i + 1)));
    const long threadsBefore = testsupport::CountThreads();
    PictureLoader loader(kDefaultPictureCacheBytes);
    std::vector<std::string> ready;
    loader.onPictureReady = [&](const PictureKey& key) { ready.push_back(key.path); };
    loader.Want(keys);
    EXPECT_EQ(loader.WorkersStarted(), PictureLoader::kWorkers);
    EXPECT_EQ(testsupport::CountThreads(), threadsBefore + PictureLoader::kWorkers)
        << "the workers are counted";
    ASSERT_TRUE(testsupport::PumpUntil([&] { return AllArrived(loader, keys); }, 10000));
    EXPECT_EQ(ready.size(), keys.size());
    EXPECT_EQ(loader.ReadsBegun(), keys.size());
    // Wanted again (a scroll back, a repaint): drawn from memory, no file read.
    loader.Want(keys);
    testsupport::PumpUntil([] { return false; }, 200);
    EXPECT_EQ(loader.ReadsBegun(), keys.size());
}

// A read that does not return until the test lets it go.
HANDLE g_release = nullptr;
Picture HangingDecode(const PictureKey& key) {
    WaitForSingleObject(g_release, INFINITE);
    return DecodePicture(key);
}

TEST(PictureLoader, ItsEndDoesNotWaitForAReadThatHangs) {
    g_release = CreateEventW(nullptr, TRUE, FALSE, nullptr);
    const long threadsBefore = testsupport::CountThreads();
    ULONGLONG took = 0;
    {
        auto loader = std::make_unique<PictureLoader>(kDefaultPictureCacheBytes, &HangingDecode);
        loader->Want({KeyOf("Z:\\nowhere\\a.dwg"), KeyOf("Z:\\nowhere\\b.dwg")});
        Sleep(100); // the reads have begun and hang
        EXPECT_EQ(loader->ReadsBegun(), 2u);
        const ULONGLONG begin = GetTickCount64();
        loader.reset();
        took = GetTickCount64() - begin;
    }
    std::printf("the loader ended in %llu ms with two reads hanging\n", took);
    EXPECT_LT(took, 2000u) << "the end waits a bounded time, not for the reads";
    // The hanging workers still stand, holding their own references; let go, they end by themselves.
    SetEvent(g_release);
    EXPECT_TRUE(testsupport::PumpUntil([&] { return testsupport::CountThreads() <= threadsBefore; }, 5000));
    CloseHandle(g_release);
}

TEST(PictureLoader, FiftyLoadersInARowLeaveNoThreadHandleOrGdiObject) {
    TempFolder folder("orvex-loader");
    std::vector<PictureKey> keys;
    for (int i = 0; i < 6; ++i)
        keys.push_back(KeyOf(WriteDrawing(folder, "q" + std::to_string(i) + ".dwg", i + 1)));
    {
        // Warm the runtime and the system's own lazy allocations before counting.
        PictureLoader loader(kDefaultPictureCacheBytes);
        loader.Want(keys);
        testsupport::PumpUntil([&] { return AllArrived(loader, keys); }, 10000);
    }
    Sleep(50);
    const long threads = testsupport::CountThreads();
    const long handles = testsupport::CountHandles();
    const long gdi = testsupport::CountGdiObjects();
    for (int call = 0; call < 50; ++call) {
        PictureLoader loader(kDefaultPictureCacheBytes);
        loader.Want(keys);
        if (call % 2 == 0) // every other one ends with reads in flight
            testsupport::PumpUntil([&] { return AllArrived(loader, keys); }, 10000);
    }
    EXPECT_TRUE(testsupport::PumpUntil([&] { return testsupport::CountThreads() <= threads; }, 5000))
        << testsupport::CountThreads() << " threads, " << threads << " before";
    std::printf("threads %ld, handles %ld, GDI objects %ld before; %ld, %ld, %ld after 50 loaders\n", threads,
                handles, gdi, testsupport::CountThreads(), testsupport::CountHandles(),
                testsupport::CountGdiObjects());
    EXPECT_GT(handles, 0) << "the handles are counted";
    EXPECT_GT(gdi, 0) << "the GDI objects are counted";
    EXPECT_LE(testsupport::CountHandles(), handles);
    // The bitmaps and DCs the decoding makes are all deleted.
    EXPECT_LE(testsupport::CountGdiObjects(), gdi);
    // No file handle stays open: every drawing can be deleted at once.
    for (const PictureKey& key : keys)
        EXPECT_TRUE(DeleteFileA(key.path.c_str())) << key.path;
}

TEST(PictureLoader, ACellThatLeftTheScreenIsNotRead) {
    TempFolder folder("orvex-loader");
    std::vector<PictureKey> keys;
    for (int i = 0; i < 40; ++i)
        keys.push_back(KeyOf(WriteDrawing(folder, "r" + std::to_string(i) + ".dwg", i + 1)));
    PictureLoader loader(kDefaultPictureCacheBytes, nullptr, 1);
    loader.Want(keys);
    // A jump: only the last two are wanted now.
    const std::vector<PictureKey> end(keys.end() - 2, keys.end());
    loader.Want(end);
    ASSERT_TRUE(testsupport::PumpUntil([&] { return AllArrived(loader, end); }, 10000));
    testsupport::PumpUntil([] { return false; }, 200);
    EXPECT_LE(loader.ReadsBegun(), 3u) << "at most the one read already begun, and the two wanted";
}

} // namespace
