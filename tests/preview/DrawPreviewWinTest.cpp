// Drawing previews into a memory device context (Windows build, runs under Wine).
#include "preview/DrawPreview.h"

#include "preview/DwgPreview.h"

#include "SyntheticDwg.h"
#include "tests/support/TempFolder.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

#include <cstdio>
#include <fstream>
#include <string>
#include <vector>

namespace {

const COLORREF kBackground = RGB(1, 2, 3); // a colour no preview uses

// A 32-bit top-down DIB section selected into a memory DC, with direct access to its pixels.
class MemoryCanvas {
public:
    MemoryCanvas(int width, int height) : m_width(width), m_height(height) {
        m_dc = CreateCompatibleDC(nullptr);
        BITMAPINFO info{};
        info.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
        info.bmiHeader.biWidth = width;
        info.bmiHeader.biHeight = -height;
        info.bmiHeader.biPlanes = 1;
        info.bmiHeader.biBitCount = 32;
        info.bmiHeader.biCompression = BI_RGB;
        m_bitmap =
            CreateDIBSection(m_dc, &info, DIB_RGB_COLORS, reinterpret_cast<void**>(&m_bits), nullptr, 0);
        m_old = SelectObject(m_dc, m_bitmap);
    }
    MemoryCanvas(const MemoryCanvas&) = delete;
    MemoryCanvas& operator=(const MemoryCanvas&) = delete;
    ~MemoryCanvas() {
        SelectObject(m_dc, m_old);
        DeleteObject(m_bitmap);
        DeleteDC(m_dc);
    }
    HDC dc() const { return m_dc; }
    RECT rect() const { return RECT{0, 0, m_width, m_height}; }
    COLORREF At(int x, int y) const {
        GdiFlush();
        const DWORD v = m_bits[static_cast<std::size_t>(y) * m_width + x];
        return RGB((v >> 16) & 0xFF, (v >> 8) & 0xFF, v & 0xFF);
    }
    // Pixels of the given rectangle that are not the colour c.
    int CountOther(const RECT& r, COLORREF c) const {
        int n = 0;
        for (int y = r.top; y < r.bottom; ++y)
            for (int x = r.left; x < r.right; ++x)
                if (At(x, y) != c)
                    ++n;
        return n;
    }

private:
    int m_width;
    int m_height;
    HDC m_dc = nullptr;
    HBITMAP m_bitmap = nullptr;
    HGDIOBJ m_old = nullptr;
    DWORD* m_bits = nullptr;
};

std::string SamplesDir() {
    std::string dir = ORVEX_SAMPLES_DIR;
    // Under Wine the Unix root is drive Z:.
    if (!dir.empty() && dir[0] == '/')
        dir = "Z:" + dir;
    return dir;
}

bool Exists(const std::string& path) {
    struct stat st;
    return stat(path.c_str(), &st) == 0;
}

std::wstring Wide(const std::string& s) {
    return std::wstring(s.begin(), s.end());
}

std::string TempFile(const char* name) {
    static const testsupport::TempFolder scratch("orvex-draw"); // one for the program, removed at its end
    return scratch.File(name);
}

void WriteAll(const std::string& path, const std::vector<unsigned char>& bytes) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

const RECT kCentre{80, 50, 120, 100};

TEST(DrawPreviewWin, SyntheticBitmapIsDrawnInTheCentre) {
    dwggen::PictureOptions picture;
    picture.width = 180;
    picture.height = 120;
    const std::string path = TempFile("orvex-draw-synthetic.dwg");
    WriteAll(path, dwggen::BuildDwg(dwggen::DrawDib(picture, 11), 100, 11));
    MemoryCanvas canvas(200, 150);
    EXPECT_TRUE(DrawDwgPreview(canvas.dc(), canvas.rect(), Wide(path).c_str(), kBackground));
    EXPECT_GT(canvas.CountOther(kCentre, kBackground), 1000);
    // 180 x 120 scaled into 200 x 150 keeps its aspect: 200 x 133, with background bands above and below.
    EXPECT_EQ(canvas.At(100, 2), kBackground);
    EXPECT_EQ(canvas.At(100, 147), kBackground);
    EXPECT_NE(canvas.At(100, 75), kBackground);
    DeleteFileA(path.c_str());
}

TEST(DrawPreviewWin, SampleBitmapIsDrawn) {
    const std::string path = SamplesDir() + "\\2004\\Arc.dwg";
    if (!Exists(path))
        GTEST_SKIP() << "sample drawings not found at " << SamplesDir() << "; skipping";
    MemoryCanvas canvas(200, 150);
    EXPECT_TRUE(DrawDwgPreview(canvas.dc(), canvas.rect(), Wide(path).c_str(), kBackground));
    EXPECT_GT(canvas.CountOther(kCentre, kBackground), 1000);
}

TEST(DrawPreviewWin, SamplePngIsDrawn) {
    const std::string path = SamplesDir() + "\\2013\\Arc.dwg";
    if (!Exists(path))
        GTEST_SKIP() << "sample drawings not found at " << SamplesDir() << "; skipping";
    MemoryCanvas canvas(200, 150);
    EXPECT_TRUE(DrawDwgPreview(canvas.dc(), canvas.rect(), Wide(path).c_str(), kBackground));
    EXPECT_GT(canvas.CountOther(kCentre, kBackground), 1000);
}

TEST(DrawPreviewWin, FileWithoutPreviewGetsBackgroundAndMark) {
    const std::string path = TempFile("orvex-draw-nopreview.dwg");
    std::vector<unsigned char> old(400, 0);
    std::copy_n("AC1009", 6, old.begin());
    WriteAll(path, old);
    MemoryCanvas canvas(200, 150);
    EXPECT_FALSE(DrawDwgPreview(canvas.dc(), canvas.rect(), Wide(path).c_str(), kBackground));
    EXPECT_EQ(canvas.At(5, 5), kBackground);
    EXPECT_EQ(canvas.At(195, 145), kBackground);
    const int marked = canvas.CountOther(canvas.rect(), kBackground);
    EXPECT_GT(marked, 0);   // the small mark
    EXPECT_LT(marked, 200); // and nothing else
    DeleteFileA(path.c_str());
}

TEST(DrawPreviewWin, MissingFileReturnsFalse) {
    MemoryCanvas canvas(100, 100);
    EXPECT_FALSE(DrawDwgPreview(canvas.dc(), canvas.rect(), L"C:\\no\\such\\file.dwg", kBackground));
    EXPECT_FALSE(DrawDwgPreview(canvas.dc(), canvas.rect(), nullptr, kBackground));
    EXPECT_EQ(canvas.At(1, 1), kBackground);
}

TEST(DrawPreviewWin, ForgedImageBytesAreNotDrawn) {
    DwgPreview forged;
    forged.kind = DwgPreviewKind::Bmp;
    forged.bytes.assign(40, 0);
    forged.bytes[0] = 40;
    forged.width = 5000;
    forged.height = 5000;
    MemoryCanvas canvas(100, 100);
    EXPECT_FALSE(DrawDwgPreviewImage(canvas.dc(), canvas.rect(), forged, kBackground));
}

} // namespace

namespace {

void PutWords(std::vector<unsigned char>& out, std::initializer_list<unsigned> words) {
    for (unsigned w : words) {
        out.push_back(static_cast<unsigned char>(w));
        out.push_back(static_cast<unsigned char>(w >> 8));
    }
}

// A placeable metafile of 300 x 200 units holding one white rectangle with a black edge.
std::vector<unsigned char> RectangleMetafile() {
    std::vector<unsigned char> wmf;
    PutWords(wmf, {0xCDD7, 0x9AC6, 0, 0, 0, 300, 200, 1440, 0, 0, 0}); // placeable header
    PutWords(wmf, {1, 9, 0x0300, 29, 0, 0, 7, 0, 0});                  // header: 29 words, largest record 7
    PutWords(wmf, {5, 0, 0x020B, 0, 0});                               // SetWindowOrg(0, 0)
    PutWords(wmf, {5, 0, 0x020C, 200, 300});                           // SetWindowExt(300, 200)
    PutWords(wmf, {7, 0, 0x041B, 190, 290, 10, 10});                   // Rectangle(10, 10, 290, 190)
    PutWords(wmf, {3, 0, 0});                                          // end
    return wmf;
}

TEST(DrawPreviewWin, MetafileIsPlayed) {
    const std::string path = TempFile("orvex-draw-metafile.dwg");
    WriteAll(path, dwggen::BuildDwgWithPicture(dwgfmt::kWmf, RectangleMetafile(), 0, 3));
    DwgPreview preview;
    ASSERT_TRUE(ReadDwgPreview(path, preview));
    EXPECT_EQ(preview.kind, DwgPreviewKind::Wmf);
    EXPECT_EQ(preview.width, 300);
    EXPECT_EQ(preview.height, 200);
    MemoryCanvas canvas(200, 150);
    EXPECT_TRUE(DrawDwgPreview(canvas.dc(), canvas.rect(), Wide(path).c_str(), kBackground));
    EXPECT_GT(canvas.CountOther(kCentre, kBackground), 1000);
    DeleteFileA(path.c_str());
}

} // namespace
