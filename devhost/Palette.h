// The host's 256-colour indexed palette. Portable.
#pragma once

#include <cstdint>

namespace devhost {

// 0xRRGGBB of a colour index; 0 (black) outside 0..255.
std::uint32_t PaletteRgb(int colorIndex);

// The same colour as 0x00BBGGRR, the form acedGetRGB answers.
std::uint32_t PaletteColorRef(int colorIndex);

} // namespace devhost
