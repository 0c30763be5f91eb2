#include "preview/DrawPreview.h"

#include "preview/DwgPreview.h"

#include <objbase.h>
#include <wincodec.h>

#include <algorithm>
#include <cstring>
#include <vector>

namespace {

// Owns one GDI object.
template <class HANDLE_TYPE> class GdiObject {
public:
    explicit GdiObject(HANDLE_TYPE handle) : m_handle(handle) {}
    GdiObject(const GdiObject&) = delete;
    GdiObject& operator=(const GdiObject&) = delete;
    ~GdiObject() {
        if (m_handle != nullptr)
            DeleteObject(m_handle);
    }
    HANDLE_TYPE get() const { return m_handle; }

private:
    HANDLE_TYPE m_handle;
};

// Puts the stretch mode back when drawing is done.
class StretchModeScope {
public:
    StretchModeScope(HDC dc, int mode) : m_dc(dc), m_old(SetStretchBltMode(dc, mode)) {
        if (mode == HALFTONE)
            SetBrushOrgEx(dc, 0, 0, nullptr); // required after choosing HALFTONE
    }
    StretchModeScope(const StretchModeScope&) = delete;
    StretchModeScope& operator=(const StretchModeScope&) = delete;
    ~StretchModeScope() {
        if (m_old != 0)
            SetStretchBltMode(m_dc, m_old);
    }

private:
    HDC m_dc;
    int m_old;
};

// A COM interface pointer released at scope end.
template <class T> class ComPtr {
public:
    ComPtr() = default;
    ComPtr(const ComPtr&) = delete;
    ComPtr& operator=(const ComPtr&) = delete;
    ~ComPtr() {
        if (m_p != nullptr)
            m_p->Release();
    }
    T** out() { return &m_p; }
    T* operator->() const { return m_p; }
    T* get() const { return m_p; }

private:
    T* m_p = nullptr;
};

// COM for this thread while a picture is decoded; undone only when this call started it.
class ComScope {
public:
    ComScope() : m_hr(CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED)) {}
    ComScope(const ComScope&) = delete;
    ComScope& operator=(const ComScope&) = delete;
    ~ComScope() {
        if (SUCCEEDED(m_hr))
            CoUninitialize();
    }

private:
    HRESULT m_hr;
};

// Largest rectangle of the picture's proportions inside area, centred.
RECT FitRect(const RECT& area, int width, int height) {
    const int areaW = area.right - area.left;
    const int areaH = area.bottom - area.top;
    if (width <= 0 || height <= 0 || areaW <= 0 || areaH <= 0)
        return area;
    int w = areaW;
    int h = static_cast<int>((static_cast<long long>(height) * areaW + width / 2) / width);
    if (h > areaH) {
        h = areaH;
        w = static_cast<int>((static_cast<long long>(width) * areaH + height / 2) / height);
    }
    w = std::max(1, w);
    h = std::max(1, h);
    RECT r;
    r.left = area.left + (areaW - w) / 2;
    r.top = area.top + (areaH - h) / 2;
    r.right = r.left + w;
    r.bottom = r.top + h;
    return r;
}

void FillBackground(HDC dc, const RECT& area, COLORREF background) {
    GdiObject<HBRUSH> brush(CreateSolidBrush(background));
    FillRect(dc, &area, brush.get());
}

// A small grey cross in the middle: the file has no picture to show.
void DrawNoPreviewMark(HDC dc, const RECT& area) {
    const int size = std::min(
        {16, static_cast<int>(area.right - area.left) / 2, static_cast<int>(area.bottom - area.top) / 2});
    if (size < 2)
        return;
    const int cx = (area.left + area.right) / 2;
    const int cy = (area.top + area.bottom) / 2;
    GdiObject<HPEN> pen(CreatePen(PS_SOLID, 1, RGB(128, 128, 128)));
    HGDIOBJ old = SelectObject(dc, pen.get());
    MoveToEx(dc, cx - size / 2, cy - size / 2, nullptr);
    LineTo(dc, cx + size / 2, cy + size / 2);
    MoveToEx(dc, cx + size / 2, cy - size / 2, nullptr);
    LineTo(dc, cx - size / 2, cy + size / 2);
    SelectObject(dc, old);
}

bool DrawDib(HDC dc, const RECT& area, const DwgPreview& preview) {
    const auto* info = reinterpret_cast<const BITMAPINFO*>(preview.bytes.data());
    const BITMAPINFOHEADER& header = info->bmiHeader;
    DWORD colours = header.biClrUsed;
    if (colours == 0 && header.biBitCount <= 8)
        colours = 1u << header.biBitCount;
    std::size_t offset = header.biSize + colours * sizeof(RGBQUAD);
    if (header.biCompression == BI_BITFIELDS && header.biSize == sizeof(BITMAPINFOHEADER))
        offset += 3 * sizeof(DWORD);
    if (offset >= preview.bytes.size())
        return false;
    const RECT target = FitRect(area, preview.width, preview.height);
    StretchModeScope mode(dc, HALFTONE);
    const int lines = StretchDIBits(dc, target.left, target.top, target.right - target.left,
                                    target.bottom - target.top, 0, 0, preview.width, preview.height,
                                    preview.bytes.data() + offset, info, DIB_RGB_COLORS, SRCCOPY);
    return lines != 0 && lines != static_cast<int>(GDI_ERROR);
}

bool DrawPng(HDC dc, const RECT& area, const DwgPreview& preview, COLORREF background) {
    ComScope com;
    ComPtr<IWICImagingFactory> factory;
    if (FAILED(CoCreateInstance(CLSID_WICImagingFactory, nullptr, CLSCTX_INPROC_SERVER,
                                IID_IWICImagingFactory, reinterpret_cast<void**>(factory.out()))))
        return false;
    ComPtr<IWICStream> stream;
    if (FAILED(factory->CreateStream(stream.out())) ||
        FAILED(stream->InitializeFromMemory(const_cast<BYTE*>(preview.bytes.data()),
                                            static_cast<DWORD>(preview.bytes.size()))))
        return false;
    ComPtr<IWICBitmapDecoder> decoder;
    if (FAILED(factory->CreateDecoderFromStream(stream.get(), nullptr, WICDecodeMetadataCacheOnDemand,
                                                decoder.out())))
        return false;
    ComPtr<IWICBitmapFrameDecode> frame;
    if (FAILED(decoder->GetFrame(0, frame.out())))
        return false;
    ComPtr<IWICFormatConverter> converter;
    if (FAILED(factory->CreateFormatConverter(converter.out())) ||
        FAILED(converter->Initialize(frame.get(), GUID_WICPixelFormat32bppPBGRA, WICBitmapDitherTypeNone,
                                     nullptr, 0.0, WICBitmapPaletteTypeCustom)))
        return false;
    UINT width = 0, height = 0;
    // The decoder's size must be the header's, which the reader kept within the limits.
    if (FAILED(converter->GetSize(&width, &height)) || width == 0 || height == 0 ||
        static_cast<int>(width) != preview.width || static_cast<int>(height) != preview.height ||
        static_cast<std::uint64_t>(width) * height * 4 > kMaxDecodedBytes)
        return false;
    std::vector<BYTE> pixels(static_cast<std::size_t>(width) * height * 4);
    if (FAILED(converter->CopyPixels(nullptr, width * 4, static_cast<UINT>(pixels.size()), pixels.data())))
        return false;
    // Premultiplied pixels over the background, so transparent parts show it.
    const BYTE bgR = GetRValue(background), bgG = GetGValue(background), bgB = GetBValue(background);
    for (std::size_t i = 0; i < pixels.size(); i += 4) {
        const unsigned rest = 255u - pixels[i + 3];
        pixels[i] = static_cast<BYTE>(pixels[i] + (bgB * rest + 127) / 255);
        pixels[i + 1] = static_cast<BYTE>(pixels[i + 1] + (bgG * rest + 127) / 255);
        pixels[i + 2] = static_cast<BYTE>(pixels[i + 2] + (bgR * rest + 127) / 255);
        pixels[i + 3] = 0;
    }
    BITMAPINFO info{};
    info.bmiHeader.biSize = sizeof(BITMAPINFOHEADER);
    info.bmiHeader.biWidth = static_cast<LONG>(width);
    info.bmiHeader.biHeight = -static_cast<LONG>(height); // top-down, as WIC delivers the rows
    info.bmiHeader.biPlanes = 1;
    info.bmiHeader.biBitCount = 32;
    info.bmiHeader.biCompression = BI_RGB;
    const RECT target = FitRect(area, static_cast<int>(width), static_cast<int>(height));
    StretchModeScope mode(dc, HALFTONE);
    const int lines = StretchDIBits(dc, target.left, target.top, target.right - target.left,
                                    target.bottom - target.top, 0, 0, static_cast<int>(width),
                                    static_cast<int>(height), pixels.data(), &info, DIB_RGB_COLORS, SRCCOPY);
    return lines != 0 && lines != static_cast<int>(GDI_ERROR);
}

bool DrawWmf(HDC dc, const RECT& area, const DwgPreview& preview) {
    constexpr std::size_t kPlaceableBytes = 22;
    const BYTE* bits = preview.bytes.data();
    std::size_t size = preview.bytes.size();
    DWORD key = 0;
    std::memcpy(&key, bits, sizeof key);
    if (key == 0x9AC6CDD7) {
        bits += kPlaceableBytes;
        size -= kPlaceableBytes;
    }
    METAFILEPICT picture{};
    picture.mm = MM_ANISOTROPIC;
    HENHMETAFILE metafile = SetWinMetaFileBits(static_cast<UINT>(size), bits, nullptr, &picture);
    if (metafile == nullptr)
        return false;
    const RECT target = FitRect(area, preview.width, preview.height);
    const BOOL played = PlayEnhMetaFile(dc, metafile, &target);
    DeleteEnhMetaFile(metafile);
    return played != FALSE;
}

bool DrawImage(HDC dc, const RECT& area, const DwgPreview& preview, COLORREF background);

} // namespace

bool DrawDwgPreviewImage(HDC dc, const RECT& area, const DwgPreview& preview, COLORREF background) {
    try {
        return DrawImage(dc, area, preview, background);
    } catch (...) {
        FillBackground(dc, area, background);
        DrawNoPreviewMark(dc, area);
        return false;
    }
}

namespace {
bool DrawImage(HDC dc, const RECT& area, const DwgPreview& preview, COLORREF background) {
    FillBackground(dc, area, background);
    bool drawn = false;
    int width = 0, height = 0;
    // Only bytes that pass the reader's checks reach GDI, which trusts the sizes inside them.
    const bool usable =
        MeasurePreviewImage(preview.kind, preview.bytes.data(), preview.bytes.size(), width, height) &&
        width == preview.width && height == preview.height;
    switch (usable ? preview.kind : DwgPreviewKind::None) {
    case DwgPreviewKind::Bmp:
        drawn = DrawDib(dc, area, preview);
        break;
    case DwgPreviewKind::Png:
        drawn = DrawPng(dc, area, preview, background);
        break;
    case DwgPreviewKind::Wmf:
        drawn = DrawWmf(dc, area, preview);
        break;
    default:
        break;
    }
    if (!drawn) {
        FillBackground(dc, area, background);
        DrawNoPreviewMark(dc, area);
    }
    return drawn;
}
} // namespace

bool DrawDwgPreview(HDC dc, const RECT& area, const wchar_t* fileName, COLORREF background) {
    // Called from paint handlers: nothing may escape, a picture that cannot be drawn is just not shown.
    try {
        DwgPreview preview;
        if (fileName != nullptr && ReadDwgPreview(std::wstring(fileName), preview))
            return DrawDwgPreviewImage(dc, area, preview, background);
    } catch (...) {
    }
    FillBackground(dc, area, background);
    DrawNoPreviewMark(dc, area);
    return false;
}

bool DrawDwgPreviewInWindow(HWND window, const wchar_t* fileName, COLORREF background) {
    if (!window || !IsWindow(window))
        return false;
    RECT area{};
    GetClientRect(window, &area);
    HDC dc = GetDC(window);
    if (!dc)
        return false;
    const bool drawn = DrawDwgPreview(dc, area, fileName, background);
    ReleaseDC(window, dc);
    return drawn;
}
