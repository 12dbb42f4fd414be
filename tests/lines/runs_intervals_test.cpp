// The run finder and the interval helpers on hand-made lists.
#include <gtest/gtest.h>

#include <climits>
#include <vector>

#include <pxfx/lines.h>

namespace {

using Ints = std::vector<int32_t>;

// CheckMaxSame's result with the run it reports.
Ints longest(const Ints &labels) {
    int32_t first = -9, last = -9;
    const int32_t m = CheckMaxSame(labels.data(), static_cast<int32_t>(labels.size()), &first, &last);
    return {m, first, last};
}

Ints combine(Ints v, int32_t minGap) {
    v.resize(2 * static_cast<size_t>(CombineMinSpace(v.data(), static_cast<int32_t>(v.size() / 2), minGap)));
    return v;
}

// CheckLapOver's result with the interval it leaves in start and end.
Ints lap(const Ints &list, int32_t s, int32_t e) {
    const int32_t r = CheckLapOver(list.data(), static_cast<int32_t>(list.size() / 2), &s, &e);
    return {r, s, e};
}

} // namespace

TEST(CheckMaxSame, RunsStartAtTheFirstLabelValue) {
    // Index 0 (the value of labels[0]) starts: the 1s never match it, the 0
    // at index 4 does; the last element ends a run uncounted.
    EXPECT_EQ(longest({0, 1, 1, 1, 0, 2, 2, 2, 2, 2, 3}), (Ints{4, 5, 10}));
    EXPECT_EQ(longest({1, -1, -1, -1, 2, 2}), (Ints{0, -9, -9})); // -1 never counts
    // A first value that is no index starts at index 0.
    EXPECT_EQ(longest({-3, -3, -3, 0}), (Ints{2, 0, 3}));
    int32_t first = -9;
    EXPECT_EQ(CheckMaxSame(Ints{1, 1, 1}.data(), 3, &first, nullptr), 1);
    EXPECT_EQ(first, -9);
    EXPECT_EQ(CheckMaxSame(nullptr, 5, nullptr, nullptr), 0);
}

TEST(CombineMinSpace, MergesCloseIntervalsAndDropsShortOnes) {
    EXPECT_EQ(combine({0, 10, 12, 15, 30, 31, 40, 60}, 5), (Ints{0, 15, 40, 60}));
    // minGap 0 means 2; an absorbed interval's end is taken even when smaller.
    EXPECT_EQ(combine({0, 20, 3, 8, 40, 45, 46, 47}, 0), (Ints{0, 8, 40, 47}));
    EXPECT_EQ(combine({INT_MIN, INT_MAX, 5, 6}, 3), (Ints{INT_MIN, 6})); // exact lengths
    EXPECT_EQ(CombineMinSpace(nullptr, 2, 3), 0);
}

TEST(CheckLapOver, CrossingIntervalWinsElseTheNextOneIsReported) {
    const Ints list = {0, 10, 20, 30, 40, 50};
    EXPECT_EQ(lap(list, 5, 25), (Ints{1, 20, 30}));
    // Nothing crosses the end: the first interval after the query is chosen,
    // with a negative overlap.
    EXPECT_EQ(lap(list, 12, 15), (Ints{0, 20, 30}));
    EXPECT_EQ(lap(list, 20, 19), (Ints{1, 20, 30})); // overlap -1 against half -1
    EXPECT_EQ(lap(list, 60, 70), (Ints{0, 0, 0}));
    // An interval from the query's end that does not pass it stops the walk.
    EXPECT_EQ(lap({25, 25, 30, 40}, 0, 25), (Ints{0, 0, 0}));
    int32_t s = 1, e = 2;
    EXPECT_EQ(CheckLapOver(nullptr, 3, &s, &e) + CheckLapOver(list.data(), 3, nullptr, &e), 0);
    EXPECT_EQ(s + e, 0);
}
