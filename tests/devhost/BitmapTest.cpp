#include "devhost/Bitmap.h"

#include <gtest/gtest.h>

namespace {

TEST(Bitmap, EncodesAndDecodes) {
    devhost::Image image;
    image.width = 3; // 9 bytes a row, padded to 12
    image.height = 2;
    image.bgr = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16, 17, 18};
    const std::vector<std::uint8_t> bytes = devhost::EncodeBmp24(image);
    ASSERT_EQ(bytes.size(), 54u + 24u);
    EXPECT_EQ(bytes[0], 'B');
    EXPECT_EQ(bytes[1], 'M');
    EXPECT_EQ(bytes[28], 24); // bits per pixel
    // Bottom-up: the file's first row is the image's last.
    EXPECT_EQ(bytes[54], 10);
    EXPECT_EQ(bytes[66], 1);
    devhost::Image back;
    ASSERT_TRUE(devhost::DecodeBmp24(bytes, back));
    EXPECT_EQ(back.width, 3);
    EXPECT_EQ(back.height, 2);
    EXPECT_EQ(back.bgr, image.bgr);
    EXPECT_EQ(devhost::CountColours(back), 6u);
}

TEST(Bitmap, RejectsOtherFiles) {
    devhost::Image image;
    EXPECT_FALSE(devhost::DecodeBmp24({}, image));
    EXPECT_FALSE(devhost::DecodeBmp24(std::vector<std::uint8_t>(60, 0), image));
}

TEST(Bitmap, BlankImageHasOneColour) {
    devhost::Image image;
    image.width = 4;
    image.height = 4;
    image.bgr.assign(48, 200);
    EXPECT_EQ(devhost::CountColours(image), 1u);
}

} // namespace
