// Showing a thumbnail's preview: through the host's operation, or drawn by the library when the host lacks
// it (Windows build, runs under Wine).
#include "preview/ShowPreview.h"

#include "hostapi/HostApi.h"

#include "SyntheticDwg.h"

#include <gtest/gtest.h>

#include <cstdarg>
#include <fstream>
#include <string>
#include <vector>

namespace {

std::vector<std::wstring> g_printed;
struct PreviewCall {
    std::wstring fileName;
    HWND window;
    std::uint32_t background;
};
std::vector<PreviewCall> g_previewCalls;

int RecordingPrintf(const wchar_t* format, ...) {
    va_list args;
    va_start(args, format);
    // The library prints its notices as one "%ls" argument.
    g_printed.push_back(std::wstring(format) == L"%ls" ? va_arg(args, const wchar_t*) : format);
    va_end(args);
    return 0;
}

bool RecordingPreview(const wchar_t* fileName, HWND window, const std::uint32_t* bgColor) {
    g_previewCalls.push_back({fileName, window, bgColor ? *bgColor : 0xFFFFFFFFu});
    return true;
}

// A plain window of this thread for the preview to be drawn into, destroyed with the object.
class PreviewWindow {
public:
    PreviewWindow()
        : m_hWnd(CreateWindowExW(0, L"STATIC", L"", WS_POPUP, 0, 0, 200, 150, nullptr, nullptr, nullptr,
                                 nullptr)) {}
    PreviewWindow(const PreviewWindow&) = delete;
    PreviewWindow& operator=(const PreviewWindow&) = delete;
    ~PreviewWindow() { DestroyWindow(m_hWnd); }
    HWND hwnd() const { return m_hWnd; }

private:
    HWND m_hWnd;
};

std::wstring SyntheticDrawing(const char* name) {
    char dir[MAX_PATH];
    GetTempPathA(MAX_PATH, dir);
    const std::string path = std::string(dir) + name;
    const std::vector<unsigned char> bytes =
        dwggen::BuildDwg(dwggen::DrawDib(dwggen::PictureOptions{}, 5), 64, 5);
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
    return std::wstring(path.begin(), path.end());
}

class ShowPreviewWin : public ::testing::Test {
protected:
    void SetUp() override {
        g_printed.clear();
        g_previewCalls.clear();
    }
    void TearDown() override { SetHostApi(HostApi{}); }
};

TEST_F(ShowPreviewWin, HostOperationIsUsedWhenTheHostHasIt) {
    HostApi api;
    api.acutPrintf = &RecordingPrintf;
    api.acdbDisplayPreviewFromDwg = &RecordingPreview;
    SetHostApi(api);
    PreviewWindow window;
    ASSERT_NE(window.hwnd(), nullptr);
    EXPECT_TRUE(ShowDwgPreview(window.hwnd(), L"door-900.dwg", 0x123456u));
    ASSERT_EQ(g_previewCalls.size(), 1u);
    EXPECT_EQ(g_previewCalls[0].fileName, L"door-900.dwg");
    EXPECT_EQ(g_previewCalls[0].window, window.hwnd());
    EXPECT_EQ(g_previewCalls[0].background, 0x123456u);
    EXPECT_TRUE(g_printed.empty());
}

TEST_F(ShowPreviewWin, LibraryDrawsWhenTheHostLacksTheOperationAndSaysSoOnce) {
    HostApi api;
    api.acutPrintf = &RecordingPrintf;
    SetHostApi(api);
    const std::wstring drawing = SyntheticDrawing("orvex-show-synthetic.dwg");
    PreviewWindow window;
    ASSERT_NE(window.hwnd(), nullptr);
    EXPECT_TRUE(ShowDwgPreview(window.hwnd(), drawing.c_str(), 0));
    EXPECT_TRUE(ShowDwgPreview(window.hwnd(), drawing.c_str(), 0));
    // A file without a preview: the library answers as the host's operation would.
    EXPECT_FALSE(ShowDwgPreview(window.hwnd(), L"no-such-drawing.dwg", 0));
    ASSERT_EQ(g_printed.size(), 1u);
    EXPECT_EQ(g_printed[0],
              L"\nOrvex1: the host does not provide acdbDisplayPreviewFromDwg; the library draws "
              L"the previews itself.\n");
    DeleteFileW(drawing.c_str());
}

TEST_F(ShowPreviewWin, NoWindowIsNotDrawnInto) {
    HostApi api;
    api.acutPrintf = &RecordingPrintf;
    SetHostApi(api);
    EXPECT_FALSE(ShowDwgPreview(nullptr, L"no-such-drawing.dwg", 0));
}

} // namespace
