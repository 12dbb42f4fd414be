// The plane reader shared by sketch and photocopy, whose outputs the golden
// hashes pin: its reads past a row's end.
#include <gtest/gtest.h>

#include "support/test_images.hpp"

TEST(SketchPhotocopy, TempExReadsOneColumnPastTheRow) {
    const uint8_t plane[2 * 3 + 1] = {1, 2, 3, 40, 50, 60, 99};
    const int32_t right[9] = {0, 0, 0, 0, 0, 0, 0, 1, 0}, ones[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 0, 2), 40); // column 3 of row 0 is row 1's first byte
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 1, 2), 99); // the byte after the plane
    EXPECT_EQ(temp_ex(plane, 3, 2, ones, 3, 0, 0), 1 + 2 + 40 + 50);
}
