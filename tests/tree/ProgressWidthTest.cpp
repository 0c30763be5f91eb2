#include "tree/ProgressWidth.h"

#include <gtest/gtest.h>

using orvex::tree::ProgressWidth;

TEST(ProgressWidth, UnknownTotalFollowsTheCurve) {
    EXPECT_EQ(ProgressWidth(0, 0), 0);
    EXPECT_EQ(ProgressWidth(0, 1), 8);
    EXPECT_EQ(ProgressWidth(0, 2), 16);
    EXPECT_EQ(ProgressWidth(0, 5), 34);
    EXPECT_EQ(ProgressWidth(0, 10), 47);
    EXPECT_EQ(ProgressWidth(0, 20), 49);
    EXPECT_EQ(ProgressWidth(-1, 20), 49);
}

TEST(ProgressWidth, UnknownTotalNeverFillsTheTrackNorShrinks) {
    int previous = 0;
    for (int count = 0; count <= 1000000; ++count) {
        const int width = ProgressWidth(0, count);
        ASSERT_LE(width, 49) << "count " << count;
        ASSERT_GE(width, previous) << "count " << count;
        previous = width;
    }
    EXPECT_EQ(ProgressWidth(0, 2147483647), 49);
}

TEST(ProgressWidth, KnownTotalIsTheShare) {
    EXPECT_EQ(ProgressWidth(1, 0), 0);
    EXPECT_EQ(ProgressWidth(1, 1), 50);
    EXPECT_EQ(ProgressWidth(3, 1), 16);
    EXPECT_EQ(ProgressWidth(4, 3), 37);
    EXPECT_EQ(ProgressWidth(10, 20), 50);
    EXPECT_EQ(ProgressWidth(1, 2147483647), 50);
    EXPECT_EQ(ProgressWidth(5, -3), 0);
}
