#include "settings/StaticColor.h"

#include "hostapi/HostApi.h"
#include "hostapi/TextConv.h"

void CStaticColor::SetColorIndex(int colorIndex) {
    m_nColorIndex = colorIndex;
    m_crColor = ::acedGetRGB(colorIndex);
}

bool CStaticColor::GetLayerColor(const std::string& layerName, int& colorIndex) {
    int found = 0;
    if (!::acdbGetLayerColor(WidenAnsi(layerName).c_str(), &found))
        return false;
    colorIndex = found;
    return true;
}

bool CStaticColor::SetColorFromLayer(const std::string& layerName) {
    int colorIndex = 0;
    if (!GetLayerColor(layerName, colorIndex))
        return false;
    SetColorIndex(colorIndex);
    Repaint();
    return true;
}

bool CStaticColor::ChooseColor() {
    int colorIndex = m_nColorIndex;
    if (!::acedSetColorDialog(&colorIndex, false, 0))
        return false;
    SetColorIndex(colorIndex);
    Repaint();
    return true;
}

void CStaticColor::Repaint() {
    if (m_hWnd)
        RedrawWindow(nullptr, nullptr, RDW_INVALIDATE | RDW_ERASE | RDW_UPDATENOW);
}

bool CStaticColor::OnCommandReflect(UINT code) {
    if (code != STN_CLICKED)
        return false;
    ChooseColor();
    return true;
}

HBRUSH CStaticColor::OnCtlColorReflect(HDC hdc, UINT message) {
    if (message != WM_CTLCOLORSTATIC)
        return nullptr;
    if (!m_brush.GetSafeHandle() || m_crBrush != m_crColor) {
        m_brush.Attach(::CreateSolidBrush(static_cast<COLORREF>(m_crColor)));
        m_crBrush = m_crColor;
    }
    if (!m_brush.GetSafeHandle())
        return nullptr;
    const CRect rc = GetClientRect();
    ::FillRect(hdc, &rc, m_brush);
    ::SetBkColor(hdc, static_cast<COLORREF>(m_crColor));
    return m_brush;
}
