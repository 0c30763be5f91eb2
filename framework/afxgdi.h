// Geometry helpers and device-context / GDI object wrappers.
//
// Ownership: CBitmap owns its handle and deletes it in the destructor; it can be moved, never copied (a
// copy would delete the handle twice). CDC is a non-owning view of an HDC; CPaintDC and CClientDC own the
// DC they obtained and give it back. CSelectObject puts the old object back into the DC when it goes out
// of scope.
#pragma once

#include <windows.h>

#include <string>
#include <utility>

// ---- geometry ---------------------------------------------------------------------------------------

class CPoint : public POINT {
public:
    CPoint() : POINT{0, 0} {}
    CPoint(int px, int py) : POINT{px, py} {}
    CPoint(POINT pt) : POINT(pt) {}
    // Unpacks the coordinates of a mouse message (signed, so positions left of or above a window work).
    explicit CPoint(LPARAM lParam)
        : POINT{static_cast<short>(LOWORD(lParam)), static_cast<short>(HIWORD(lParam))} {}
    void Offset(int dx, int dy) {
        x += dx;
        y += dy;
    }
    bool operator==(const POINT& o) const { return x == o.x && y == o.y; }
    bool operator!=(const POINT& o) const { return !(*this == o); }
};

class CSize : public SIZE {
public:
    CSize() : SIZE{0, 0} {}
    CSize(int width, int height) : SIZE{width, height} {}
    CSize(SIZE s) : SIZE(s) {}
    bool operator==(const SIZE& o) const { return cx == o.cx && cy == o.cy; }
    bool operator!=(const SIZE& o) const { return !(*this == o); }
};

class CRect : public RECT {
public:
    CRect() : RECT{0, 0, 0, 0} {}
    CRect(int l, int t, int r, int b) : RECT{l, t, r, b} {}
    CRect(const RECT& rc) : RECT(rc) {}
    CRect(POINT topLeft, SIZE size) : RECT{topLeft.x, topLeft.y, topLeft.x + size.cx, topLeft.y + size.cy} {}

    int Width() const { return right - left; }
    int Height() const { return bottom - top; }
    CSize Size() const { return CSize(Width(), Height()); }
    CPoint TopLeft() const { return CPoint(left, top); }
    CPoint BottomRight() const { return CPoint(right, bottom); }
    CPoint CenterPoint() const { return CPoint((left + right) / 2, (top + bottom) / 2); }
    bool IsRectEmpty() const { return left >= right || top >= bottom; }
    bool PtInRect(POINT pt) const { return pt.x >= left && pt.x < right && pt.y >= top && pt.y < bottom; }

    void SetRect(int l, int t, int r, int b) { *this = CRect(l, t, r, b); }
    void SetRectEmpty() { SetRect(0, 0, 0, 0); }
    void OffsetRect(int dx, int dy) {
        left += dx;
        right += dx;
        top += dy;
        bottom += dy;
    }
    void OffsetRect(POINT pt) { OffsetRect(pt.x, pt.y); }
    void InflateRect(int dx, int dy) {
        left -= dx;
        right += dx;
        top -= dy;
        bottom += dy;
    }
    void DeflateRect(int dx, int dy) { InflateRect(-dx, -dy); }
    void NormalizeRect() {
        if (left > right)
            std::swap(left, right);
        if (top > bottom)
            std::swap(top, bottom);
    }
    bool IntersectRect(const RECT& a, const RECT& b) { return ::IntersectRect(this, &a, &b) != FALSE; }
    bool UnionRect(const RECT& a, const RECT& b) { return ::UnionRect(this, &a, &b) != FALSE; }

    bool operator==(const RECT& o) const {
        return left == o.left && top == o.top && right == o.right && bottom == o.bottom;
    }
    bool operator!=(const RECT& o) const { return !(*this == o); }
    operator LPRECT() { return this; }
    operator LPCRECT() const { return this; }
};

// ---- owned GDI objects ------------------------------------------------------------------------------

template <class H> class CGdiObjectT {
public:
    CGdiObjectT() = default;
    explicit CGdiObjectT(H h) : m_handle(h) {}
    ~CGdiObjectT() { DeleteObject(); }
    CGdiObjectT(const CGdiObjectT&) = delete;
    CGdiObjectT& operator=(const CGdiObjectT&) = delete;
    CGdiObjectT(CGdiObjectT&& o) noexcept : m_handle(o.Detach()) {}
    CGdiObjectT& operator=(CGdiObjectT&& o) noexcept {
        if (this != &o)
            Attach(o.Detach());
        return *this;
    }

    H GetSafeHandle() const { return m_handle; }
    operator H() const { return m_handle; }
    // Takes ownership of h; the handle held before is deleted.
    void Attach(H h) {
        DeleteObject();
        m_handle = h;
    }
    H Detach() { return std::exchange(m_handle, nullptr); }
    bool DeleteObject() {
        if (!m_handle)
            return false;
        ::DeleteObject(std::exchange(m_handle, nullptr));
        return true;
    }

protected:
    bool Take(H h) {
        Attach(h);
        return h != nullptr;
    }

private:
    H m_handle = nullptr;
};

class CBitmap : public CGdiObjectT<HBITMAP> {
public:
    bool LoadBitmap(HINSTANCE hInst, UINT resourceId) {
        return Take(::LoadBitmapA(hInst, MAKEINTRESOURCEA(resourceId)));
    }
    bool CreateCompatibleBitmap(HDC hdc, int width, int height) {
        return Take(::CreateCompatibleBitmap(hdc, width, height));
    }
    CSize GetSize() const {
        BITMAP bm{};
        if (GetSafeHandle() && ::GetObjectA(GetSafeHandle(), sizeof bm, &bm))
            return CSize(bm.bmWidth, bm.bmHeight);
        return CSize();
    }
};

// ---- device contexts --------------------------------------------------------------------------------

// A non-owning view of a device context.
class CDC {
public:
    CDC() = default;
    explicit CDC(HDC hdc) : m_hDC(hdc) {}
    virtual ~CDC() = default;
    CDC(const CDC&) = delete;
    CDC& operator=(const CDC&) = delete;

    HDC GetSafeHdc() const { return m_hDC; }
    operator HDC() const { return m_hDC; }

    HGDIOBJ SelectObject(HGDIOBJ obj) { return ::SelectObject(m_hDC, obj); }
    HGDIOBJ SelectStockObject(int index) { return ::SelectObject(m_hDC, ::GetStockObject(index)); }
    int SaveDC() { return ::SaveDC(m_hDC); }
    bool RestoreDC(int saved) { return ::RestoreDC(m_hDC, saved) != FALSE; }

    COLORREF SetTextColor(COLORREF c) { return ::SetTextColor(m_hDC, c); }
    COLORREF SetBkColor(COLORREF c) { return ::SetBkColor(m_hDC, c); }
    int SetBkMode(int mode) { return ::SetBkMode(m_hDC, mode); }
    int SetMapMode(int mode) { return ::SetMapMode(m_hDC, mode); }
    CPoint SetViewportOrg(int x, int y) {
        POINT old{};
        ::SetViewportOrgEx(m_hDC, x, y, &old);
        return old;
    }
    int GetDeviceCaps(int index) const { return ::GetDeviceCaps(m_hDC, index); }

    void FillRect(const RECT& rc, HBRUSH brush) { ::FillRect(m_hDC, &rc, brush); }
    void FillSolidRect(const RECT& rc, COLORREF color) {
        COLORREF old = ::SetBkColor(m_hDC, color);
        ::ExtTextOutA(m_hDC, 0, 0, ETO_OPAQUE, &rc, nullptr, 0, nullptr);
        ::SetBkColor(m_hDC, old);
    }
    void FrameRect(const RECT& rc, HBRUSH brush) { ::FrameRect(m_hDC, &rc, brush); }
    bool Rectangle(const RECT& rc) {
        return ::Rectangle(m_hDC, rc.left, rc.top, rc.right, rc.bottom) != FALSE;
    }
    CPoint MoveTo(int x, int y) {
        POINT old{};
        ::MoveToEx(m_hDC, x, y, &old);
        return old;
    }
    bool LineTo(int x, int y) { return ::LineTo(m_hDC, x, y) != FALSE; }
    bool DrawEdge(RECT rc, UINT edge, UINT flags) { return ::DrawEdge(m_hDC, &rc, edge, flags) != FALSE; }
    bool DrawFocusRect(const RECT& rc) { return ::DrawFocusRect(m_hDC, &rc) != FALSE; }

    bool TextOut(int x, int y, const std::string& text) {
        return ::TextOutA(m_hDC, x, y, text.c_str(), static_cast<int>(text.size())) != FALSE;
    }
    int DrawText(const std::string& text, RECT rc, UINT format) {
        return ::DrawTextA(m_hDC, text.c_str(), static_cast<int>(text.size()), &rc, format);
    }
    CSize GetTextExtent(const std::string& text) const {
        SIZE s{};
        ::GetTextExtentPoint32A(m_hDC, text.c_str(), static_cast<int>(text.size()), &s);
        return s;
    }
    bool GetTextMetrics(TEXTMETRICA* tm) const { return ::GetTextMetricsA(m_hDC, tm) != FALSE; }

    bool BitBlt(int x, int y, int width, int height, HDC src, int xSrc, int ySrc, DWORD rop) {
        return ::BitBlt(m_hDC, x, y, width, height, src, xSrc, ySrc, rop) != FALSE;
    }
    int IntersectClipRect(const RECT& rc) {
        return ::IntersectClipRect(m_hDC, rc.left, rc.top, rc.right, rc.bottom);
    }
    CRect GetClipBox() const {
        RECT rc{};
        ::GetClipBox(m_hDC, &rc);
        return rc;
    }
    COLORREF GetPixel(int x, int y) const { return ::GetPixel(m_hDC, x, y); }

protected:
    HDC m_hDC = nullptr;
};

// The DC of one WM_PAINT: BeginPaint in the constructor, EndPaint in the destructor.
class CPaintDC : public CDC {
public:
    explicit CPaintDC(HWND hwnd) : m_hWnd(hwnd) { m_hDC = ::BeginPaint(hwnd, &m_ps); }
    ~CPaintDC() override { ::EndPaint(m_hWnd, &m_ps); }
    PAINTSTRUCT m_ps{};

private:
    HWND m_hWnd;
};

// The client-area DC of a window, released in the destructor.
class CClientDC : public CDC {
public:
    explicit CClientDC(HWND hwnd) : m_hWnd(hwnd) { m_hDC = ::GetDC(hwnd); }
    ~CClientDC() override { ::ReleaseDC(m_hWnd, m_hDC); }

private:
    HWND m_hWnd;
};

// Selects an object into a DC for the lifetime of the restorer, then puts the previous one back.
class CSelectObject {
public:
    CSelectObject(HDC hdc, HGDIOBJ obj) : m_hDC(hdc), m_old(::SelectObject(hdc, obj)) {}
    ~CSelectObject() {
        if (m_old)
            ::SelectObject(m_hDC, m_old);
    }
    CSelectObject(const CSelectObject&) = delete;
    CSelectObject& operator=(const CSelectObject&) = delete;

private:
    HDC m_hDC;
    HGDIOBJ m_old;
};
