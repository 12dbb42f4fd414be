// Hostile input for every line-detection function: the plane functions
// through the contract table, histograms and interval lists at their extremes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

TEST(Hostile, Planes) {
    // A null result slot means "in place" for the functions that take one.
    check_contracts<Image>({
        {.name = "RecognizeYUV",
         .formats = {8},
         .call = [](C &c) { return int64_t(RecognizeYUV(c.a, c.slot)); },
         .slot = false},
        {.name = "ImgDecode",
         .formats = {8},
         .call = [](C &c) { return ImgDecode(c.a, c.slot), kNoResult; },
         .failure = kNoResult,
         .slot = false},
        {.name = "MyResample2",
         .formats = {8},
         .call = [](C &c) { return (c.out = MyResample2(c.a, c.p)) != nullptr; },
         .slot = false},
        {.name = "BinImg", .formats = {8}, .call = [](C &c) { return int64_t(BinImg(c.a, c.slot)); }, .slot = false},
        {.name = "DetectLines", .formats = {8}, .call = [](C &c) { return int64_t(DetectLines(c.a)); }, .slot = false},
        {.name = "MyEdge", .formats = {8}, .call = [](C &c) { return int64_t(MyEdge(c.a, c.slot)); }, .slot = false},
        {.name = "MyFliter",
         .formats = {8},
         .call = [](C &c) { return int64_t(MyFliter(c.a, c.slot)); },
         .slot = false},
        {.name = "MyFliter1",
         .formats = {8},
         .call = [](C &c) { return int64_t(MyFliter1(c.a, c.slot)); },
         .slot = false},
        {.name = "RGB_Reverse",
         .formats = {8, 0, 1, 4, 12, 16, 24, 32, 48},
         .call = [](C &c) { return int64_t(RGB_Reverse(c.a)); },
         .slot = false},
    });
}

TEST(Hostile, HistogramsAndIntervals) {
    ImgLineDecode();
    CheckAvailableBlock();
    RebuildImg();
    uint32_t hist[256];
    for (uint32_t &h : hist)
        h = 0xFFFFFFFFu;
    int32_t list[8] = {INT_MIN, -5, 0, 0, 3, INT_MAX, INT_MAX, INT_MIN}, first = 7, last = 7;
    EXPECT_EQ(GetMaxHtoThrod2(nullptr, 100) + CheckMaxSame(nullptr, 5, &first, &last), 255);
    EXPECT_EQ(CombineMinSpace(nullptr, 4, 1) + CheckLapOver(list, 4, nullptr, &last), 0);
    EXPECT_EQ(first + last, 14); // nothing written
    for (int32_t v : kExtremes) {
        const int32_t t = GetMaxHtoThrod2(hist, v);
        EXPECT_TRUE(t >= 60 && t <= 256) << v << ": " << t;
        const int32_t n = std::clamp(v, -1, 8);
        const int32_t run = CheckMaxSame(list, n, &first, &last);
        EXPECT_TRUE(n < 2 ? run == 0 : (run >= 0 && run <= n)) << v;
        int32_t copy[8];
        std::copy(list, list + 8, copy);
        const int32_t pairs = std::clamp(v, -1, 4);
        EXPECT_LE(CombineMinSpace(copy, pairs, v), std::max(pairs, 0)) << v;
        int32_t s = v, e = ~v;
        const int32_t covered = CheckLapOver(list, pairs, &s, &e);
        EXPECT_TRUE(covered == 0 || covered == 1) << v;
    }
}
