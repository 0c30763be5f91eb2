// The colour swatch of the folder settings dialog: a framed static that shows one colour of the host's
// indexed palette and, when clicked, lets the user choose another in the host's colour dialog.
//
// Painting. The static keeps its black frame; the parent's colour message (WM_CTLCOLORSTATIC, reflected
// here) fills the whole client area with the fill colour first. The brush is the swatch's own, remade
// when the colour changes and deleted with the swatch.
#pragma once

#include "framework/afxwin.h"

#include <cstdint>
#include <string>

class CStaticColor : public CStatic {
public:
    CStaticColor() = default;

    // The colour index; also sets the fill to the host's RGB of that index.
    void SetColorIndex(int colorIndex);
    int GetColorIndex() const { return m_nColorIndex; }
    // The fill as 0x00BBGGRR.
    std::uint32_t GetFillColor() const { return m_crColor; }

    // Takes the colour of a layer of the working drawing; false (the swatch unchanged) when the drawing
    // has no such layer.
    bool SetColorFromLayer(const std::string& layerName);
    // The colour index of a layer of the working drawing into colorIndex; false when there is none.
    static bool GetLayerColor(const std::string& layerName, int& colorIndex);

    // Opens the host's colour dialog on the swatch's index (ByLayer and ByBlock not offered, 0 as the
    // current layer's colour); a confirmed colour becomes the swatch's and is painted at once. True when
    // the user confirmed one.
    bool ChooseColor();

protected:
    bool OnCommandReflect(UINT code) override; // STN_CLICKED
    HBRUSH OnCtlColorReflect(HDC hdc, UINT message) override;

private:
    void Repaint();

    std::uint32_t m_crColor = 0xFFFFFF; // the fill, white until an index is set
    int m_nColorIndex = 7;
    CGdiObjectT<HBRUSH> m_brush; // of m_crColor; made on first paint
    std::uint32_t m_crBrush = 0;
};
