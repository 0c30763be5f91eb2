#include "devhost/Bitmap.h"

#include <unordered_set>

namespace devhost {
namespace {

void Put16(std::vector<std::uint8_t>& out, std::size_t at, std::uint32_t value) {
    out[at] = static_cast<std::uint8_t>(value);
    out[at + 1] = static_cast<std::uint8_t>(value >> 8);
}

void Put32(std::vector<std::uint8_t>& out, std::size_t at, std::uint32_t value) {
    for (int i = 0; i < 4; ++i)
        out[at + i] = static_cast<std::uint8_t>(value >> (8 * i));
}

std::uint32_t Get32(const std::vector<std::uint8_t>& in, std::size_t at) {
    return static_cast<std::uint32_t>(in[at]) | static_cast<std::uint32_t>(in[at + 1]) << 8 |
           static_cast<std::uint32_t>(in[at + 2]) << 16 | static_cast<std::uint32_t>(in[at + 3]) << 24;
}

std::uint32_t Get16(const std::vector<std::uint8_t>& in, std::size_t at) {
    return static_cast<std::uint32_t>(in[at]) | static_cast<std::uint32_t>(in[at + 1]) << 8;
}

constexpr std::size_t kHeaders = 14 + 40;

} // namespace

std::vector<std::uint8_t> EncodeBmp24(const Image& image) {
    const std::size_t stride = (static_cast<std::size_t>(image.width) * 3 + 3) & ~static_cast<std::size_t>(3);
    const std::size_t pixels = stride * static_cast<std::size_t>(image.height);
    std::vector<std::uint8_t> out(kHeaders + pixels, 0);
    out[0] = 'B';
    out[1] = 'M';
    Put32(out, 2, static_cast<std::uint32_t>(out.size()));
    Put32(out, 10, static_cast<std::uint32_t>(kHeaders));
    Put32(out, 14, 40);
    Put32(out, 18, static_cast<std::uint32_t>(image.width));
    Put32(out, 22, static_cast<std::uint32_t>(image.height)); // positive: bottom-up
    Put16(out, 26, 1);
    Put16(out, 28, 24);
    Put32(out, 34, static_cast<std::uint32_t>(pixels));
    Put32(out, 38, 2835); // 72 dpi
    Put32(out, 42, 2835);
    const std::size_t row = static_cast<std::size_t>(image.width) * 3;
    for (int y = 0; y < image.height; ++y) {
        const std::uint8_t* source = image.bgr.data() + static_cast<std::size_t>(y) * row;
        std::uint8_t* target =
            out.data() + kHeaders + static_cast<std::size_t>(image.height - 1 - y) * stride;
        std::copy(source, source + row, target);
    }
    return out;
}

bool DecodeBmp24(const std::vector<std::uint8_t>& bytes, Image& image) {
    if (bytes.size() < kHeaders || bytes[0] != 'B' || bytes[1] != 'M' || Get32(bytes, 14) < 40 ||
        Get16(bytes, 26) != 1 || Get16(bytes, 28) != 24 || Get32(bytes, 30) != 0)
        return false;
    const auto width = static_cast<std::int32_t>(Get32(bytes, 18));
    auto height = static_cast<std::int32_t>(Get32(bytes, 22));
    const bool topDown = height < 0;
    if (topDown)
        height = -height;
    if (width <= 0 || height <= 0 || width > 100000 || height > 100000)
        return false;
    const std::size_t offset = Get32(bytes, 10);
    const std::size_t stride = (static_cast<std::size_t>(width) * 3 + 3) & ~static_cast<std::size_t>(3);
    if (offset > bytes.size() || (bytes.size() - offset) / stride < static_cast<std::size_t>(height))
        return false;
    image.width = width;
    image.height = height;
    const std::size_t row = static_cast<std::size_t>(width) * 3;
    image.bgr.assign(row * static_cast<std::size_t>(height), 0);
    for (int y = 0; y < height; ++y) {
        const std::size_t sourceRow =
            topDown ? static_cast<std::size_t>(y) : static_cast<std::size_t>(height - 1 - y);
        const std::uint8_t* source = bytes.data() + offset + sourceRow * stride;
        std::copy(source, source + row, image.bgr.begin() + static_cast<std::ptrdiff_t>(y * row));
    }
    return true;
}

std::size_t CountColours(const Image& image) {
    std::unordered_set<std::uint32_t> colours;
    for (std::size_t i = 0; i + 2 < image.bgr.size(); i += 3)
        colours.insert(static_cast<std::uint32_t>(image.bgr[i]) |
                       static_cast<std::uint32_t>(image.bgr[i + 1]) << 8 |
                       static_cast<std::uint32_t>(image.bgr[i + 2]) << 16);
    return colours.size();
}

} // namespace devhost
