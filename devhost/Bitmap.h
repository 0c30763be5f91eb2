// 24-bit BMP files of screenshots. Portable.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace devhost {

// Pixels as rows of blue, green, red bytes, top row first, no padding.
struct Image {
    int width = 0;
    int height = 0;
    std::vector<std::uint8_t> bgr;
};

// The bytes of a BMP file (BITMAPFILEHEADER, BITMAPINFOHEADER, bottom-up rows padded to 4 bytes).
std::vector<std::uint8_t> EncodeBmp24(const Image& image);

// Reads back what EncodeBmp24 writes (24-bit, uncompressed, either row order); false for anything else.
bool DecodeBmp24(const std::vector<std::uint8_t>& bytes, Image& image);

// How many different colours the image has (a blank capture has one).
std::size_t CountColours(const Image& image);

} // namespace devhost
