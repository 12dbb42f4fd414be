// Hostile input beyond the registry's contracts: straightening short of
// memory, histograms and interval lists at their extremes.
#include "support/hostile.hpp"

using namespace pxtest;
using namespace pxtest::hostile;

// The contracts' pictures are below the size the straightening works on. A call
// that runs out of memory fails whole: it returns what a full run returns, or
// nothing and leaves its input as it was.
TEST(Hostile, StraighteningWithoutMemory) {
    PXTEST_REQUIRE_ALLOCATION_HOOK();
    Owned src = random_image(130, 20, 8, 3), work = clone(src.get()), resampledWant(MyResample2(src.get(), 2));
    Slot want, out;
    ASSERT_EQ(RecognizeYUV(work.get(), &want), 1);
    const int made = sweep_allocation_failures([&] {
        std::copy(src->bits, src->bits + src->pitch * 20, work->bits);
        free_Image(&out.image, 0);
        const bool done = RecognizeYUV(work.get(), &out) == 1;
        EXPECT_EQ(diff(work.get(), src.get()) + diff(done ? out.get() : want.get(), want.get()), "");
        Owned resampled(MyResample2(src.get(), 2));
        EXPECT_EQ(resampled ? diff(resampled.get(), resampledWant.get()) : "", "");
    });
    EXPECT_GT(made, 4); // both worked on the picture
}

TEST(Hostile, HistogramsAndIntervals) {
    ImgLineDecode(), CheckAvailableBlock(), RebuildImg();
    const std::vector<uint32_t> hist(256, 0xFFFFFFFFu);
    int32_t list[8] = {INT_MIN, -5, 0, 0, 3, INT_MAX, INT_MAX, INT_MIN}, first = 7, last = 7;
    EXPECT_EQ(GetMaxHtoThrod2(nullptr, 100) + CheckMaxSame(nullptr, 5, &first, &last), 255);
    EXPECT_EQ(CombineMinSpace(nullptr, 4, 1) + CheckLapOver(list, 4, nullptr, &last), 0);
    EXPECT_EQ(first + last, 14);                                            // nothing written
    EXPECT_EQ(CheckLapOver(nullptr, 3, &first, &last) + (first | last), 0); // a null list: the empty interval
    for (int32_t v : kExtremes) {
        const int32_t n = std::clamp(v, -1, 8), pairs = std::clamp(v, -1, 4), t = GetMaxHtoThrod2(hist.data(), v);
        int32_t copy[8], s = v, e = ~v, run = CheckMaxSame(list, n, &first, &last);
        std::copy(list, list + 8, copy);
        EXPECT_TRUE(t >= 60 && t <= 255 && run >= 0 && run <= std::max(n, 0)) << v;
        EXPECT_TRUE(CombineMinSpace(copy, pairs, v) <= std::max(pairs, 0) && CheckLapOver(list, pairs, &s, &e) <= 1)
            << v;
    }
}
