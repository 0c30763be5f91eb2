#include "afxgdi.h"

#include <cstring>

bool CFont::CreatePointFont(int pointSizeTenths, const char* faceName, HDC hdc) {
    HDC screen = hdc ? hdc : ::GetDC(nullptr);
    LOGFONTA lf{};
    // Tenths of a point to device pixels: points are 1/72 inch.
    lf.lfHeight = -::MulDiv(pointSizeTenths, ::GetDeviceCaps(screen, LOGPIXELSY), 720);
    lf.lfCharSet = DEFAULT_CHARSET;
    if (faceName)
        ::lstrcpynA(lf.lfFaceName, faceName, LF_FACESIZE);
    if (!hdc)
        ::ReleaseDC(nullptr, screen);
    return CreateFontIndirect(lf);
}

CMemDC::CMemDC(HDC target, const RECT& rc) : m_hTarget(target), m_rc(rc) {
    m_hDC = ::CreateCompatibleDC(target);
    if (!m_hDC) {
        m_hDC = target; // no buffer: draw straight onto the target
        return;
    }
    if (m_bitmap.CreateCompatibleBitmap(target, m_rc.Width(), m_rc.Height())) {
        m_oldBitmap = ::SelectObject(m_hDC, m_bitmap);
        ::SetWindowOrgEx(m_hDC, m_rc.left, m_rc.top, nullptr);
        // Same font and colours as the target so that text drawn into the buffer looks the same.
        ::SelectObject(m_hDC, ::GetCurrentObject(target, OBJ_FONT));
        ::SetTextColor(m_hDC, ::GetTextColor(target));
        ::SetBkColor(m_hDC, ::GetBkColor(target));
    } else {
        ::DeleteDC(m_hDC);
        m_hDC = target;
    }
}

CMemDC::~CMemDC() {
    if (m_hDC == m_hTarget)
        return;
    ::BitBlt(m_hTarget, m_rc.left, m_rc.top, m_rc.Width(), m_rc.Height(), m_hDC, m_rc.left, m_rc.top,
             SRCCOPY);
    ::SelectObject(m_hDC, m_oldBitmap);
    ::DeleteDC(m_hDC); // the bitmap member is deleted after this, once it is out of the DC
}
