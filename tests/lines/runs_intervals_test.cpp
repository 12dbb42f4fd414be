// The run finder and the interval helpers on hand-made lists.
#include <gtest/gtest.h>

#include <climits>
#include <vector>

#include <pxfx/lines.h>

TEST(CheckMaxSame, RunsStartAtTheFirstLabelValue) {
    const int32_t ones[6] = {1, 1, 1, 1, 1, 1};
    EXPECT_EQ(CheckMaxSame(ones, 6, nullptr, nullptr), 4);
    // Start index 0 (the value of labels[0]); the run of 1s never counts since
    // it is compared with labels[0]; the 0 at index 4 does.
    const int32_t mixed[11] = {0, 1, 1, 1, 0, 2, 2, 2, 2, 2, 3};
    int32_t first = -9, last = -9;
    EXPECT_EQ(CheckMaxSame(mixed, 11, &first, &last), 4);
    EXPECT_EQ(first, 5);
    EXPECT_EQ(last, 10);
    // Excluded rows (-1) do not count.
    const int32_t excluded[6] = {1, -1, -1, -1, 2, 2};
    EXPECT_EQ(CheckMaxSame(excluded, 6, nullptr, nullptr), 0);
    // One output pointer alone is not written.
    first = -9;
    EXPECT_EQ(CheckMaxSame(mixed, 11, &first, nullptr), 4);
    EXPECT_EQ(first, -9);
}

TEST(CheckMaxSame, FirstLabelOutsideTheListStartsAtZero) {
    const int32_t big[5] = {7, 7, 7, 1, 1};
    int32_t first = -9, last = -9;
    EXPECT_EQ(CheckMaxSame(big, 5, &first, &last), 2);
    EXPECT_EQ(first, 0);
    EXPECT_EQ(last, 3);
    const int32_t negative[4] = {-3, -3, -3, 0};
    EXPECT_EQ(CheckMaxSame(negative, 4, nullptr, nullptr), 2);
    EXPECT_EQ(CheckMaxSame(big, 1, nullptr, nullptr), 0);
    EXPECT_EQ(CheckMaxSame(big, 0, nullptr, nullptr), 0);
    EXPECT_EQ(CheckMaxSame(nullptr, 5, nullptr, nullptr), 0);
}

TEST(CombineMinSpace, MergesCloseIntervalsAndDropsShortOnes) {
    std::vector<int32_t> v = {0, 10, 12, 15, 30, 31, 40, 60};
    ASSERT_EQ(CombineMinSpace(v.data(), 4, 5), 2);
    EXPECT_EQ(std::vector<int32_t>(v.begin(), v.begin() + 4), (std::vector<int32_t>{0, 15, 40, 60}));
    // Absorbed short intervals set the end even when it moves back.
    v = {0, 20, 3, 8, 40, 45, 46, 47};
    ASSERT_EQ(CombineMinSpace(v.data(), 4, 0), 2); // minGap 0 means 2
    EXPECT_EQ(std::vector<int32_t>(v.begin(), v.begin() + 4), (std::vector<int32_t>{0, 8, 40, 47}));
    // Lengths and gaps are exact at the ends of the range.
    v = {INT_MIN, INT_MAX, 5, 6};
    ASSERT_EQ(CombineMinSpace(v.data(), 2, 3), 1);
    EXPECT_EQ(v[0], INT_MIN);
    EXPECT_EQ(v[1], 6);
    EXPECT_EQ(CombineMinSpace(v.data(), 0, 3), 0);
    EXPECT_EQ(CombineMinSpace(nullptr, 2, 3), 0);
}

TEST(CheckLapOver, CrossingIntervalWinsElseTheNextOneIsReported) {
    const int32_t list[6] = {0, 10, 20, 30, 40, 50};
    int32_t s = 5, e = 25;
    EXPECT_EQ(CheckLapOver(list, 3, &s, &e), 1);
    EXPECT_EQ(s, 20);
    EXPECT_EQ(e, 30);
    // Nothing crosses the end: the first interval after the query is chosen,
    // with a negative overlap, so the answer is 0.
    s = 12, e = 15;
    EXPECT_EQ(CheckLapOver(list, 3, &s, &e), 0);
    EXPECT_EQ(s, 20);
    EXPECT_EQ(e, 30);
    // Overlap -1 against half of -1 (arithmetic shift) counts as covered.
    s = 20, e = 19;
    EXPECT_EQ(CheckLapOver(list, 3, &s, &e), 1);
    EXPECT_EQ(s, 20);
    // An interval starting at the query's end and not passing it stops the walk.
    const int32_t stop[4] = {25, 25, 30, 40};
    s = 0, e = 25;
    EXPECT_EQ(CheckLapOver(stop, 2, &s, &e), 0);
    EXPECT_EQ(s + e, 0);
    s = 60, e = 70;
    EXPECT_EQ(CheckLapOver(list, 3, &s, &e), 0);
    EXPECT_EQ(s, 0);
    EXPECT_EQ(e, 0);
    s = 1, e = 2;
    EXPECT_EQ(CheckLapOver(nullptr, 3, &s, &e), 0);
    EXPECT_EQ(s + e, 0);
    EXPECT_EQ(CheckLapOver(list, 3, nullptr, &e), 0);
}
