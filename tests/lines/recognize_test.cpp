// Straightening along tilted boundaries, RecognizeYUV's limits and delivery,
// the vertical resampler against its formula, and the run finder and the
// interval helpers on hand-made lists.
#include "lines/lines_internal.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

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

// Dark (20) above the boundary row top + x / run, bright (230) from it down.
Owned tilted(int32_t w, int32_t h, int32_t run = 8, int32_t top = 30) {
    Owned im = make(w, h, 8);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            im->bits[y * im->pitch + x] = y < top + x / run ? 20 : 230;
    return im;
}

} // namespace

TEST(Straighten, FollowsTheStripBoundariesAndReadsClamped) {
    // Boundary rows 38 at column 65 and 48 at column 145. When rows 30 (top)
    // and 31 of column 65 form an edge, the line moves by the mean distance
    // from row 48 + 6 to it over columns 65..144, 11.5.
    Owned im = tilted(200, 100);
    std::vector<int32_t> l(700);
    for (int32_t shift : {0, 12}) {
        pxfx::lines::detect_boundary(*pxfx::view_of(im.get()), l.data());
        for (int32_t c = 0; c < 200; ++c)
            ASSERT_EQ(l[c], 38 + shift + (c - 65) / 8) << c;
        im->bits[31 * im->pitch + 65] = 230;
    }
    // Steep, nearly level, and reaching above the picture at the left end.
    const int32_t cases[][4] = {{200, 100, 8, 30}, {700, 60, 200, 20}, {200, 150, 2, -10}};
    for (auto [w, h, run, top] : cases) {
        Owned im = tilted(w, h, run, top), got = make(w, h, 8), want = make(w, h, 8);
        pxfx::lines::detect_boundary(*pxfx::view_of(im.get()), l.data());
        pxfx::lines::straighten(*pxfx::view_of(im.get()), l.data(), *pxfx::view_of(got.get()));
        for (int32_t r = 0; r < std::min(h - l[0], h - l[w - 1]); ++r)
            for (int32_t c = 0; c < w; ++c)
                SetPixelIndex(want.get(), c, r, GetPixelIndex(im.get(), c, l[c] + r));
        EXPECT_EQ(diff(got.get(), want.get()), "") << w << "x" << h;
        EXPECT_EQ(top < 0, l[0] < 0);
        // Within one block the copied rows come out the same, also where
        // columns read above the picture.
        Owned noisy = random_image(w, h, 8, 5), apart = make(w, h, 8);
        pxfx::lines::straighten(*pxfx::view_of(noisy.get()), l.data(), *pxfx::view_of(apart.get()));
        pxfx::lines::straighten(*pxfx::view_of(noisy.get()), l.data(), *pxfx::view_of(noisy.get()));
        for (int32_t r = 0; r < std::min(h - l[0], h - l[w - 1]); ++r)
            ASSERT_EQ(std::memcmp(noisy->bits + r * noisy->pitch, apart->bits + r * apart->pitch, w), 0)
                << w << "x" << h << " row " << r;
    }
}

// The registry's contract pins the planes it refuses.
TEST(RecognizeYUV, WorksInPlaceAndDeliversIntoTheSlot) {
    for (auto [w, h] : {std::pair{121, 13}, {131, 40}, {200, 100}}) {
        Owned im = random_image(w, h, 8, static_cast<uint32_t>(w)), inPlace = clone(im.get());
        ASSERT_EQ(RecognizeYUV(inPlace.get(), nullptr), 1);
        Slot given; // an image in the slot receives a copy
        given.image = malloc_Image(w, h, 8);
        ImgDecode(im.get(), &given);
        EXPECT_EQ(diff(given.get(), inPlace.get()), "");
    }
}

TEST(MyResample2, InterpolatesRowsWithRounding) {
    // Narrower than RecognizeYUV accepts, so the result is the resampling.
    Owned src = random_image(17, 4, 8, 3);
    for (int32_t f = 2; f <= 49; ++f) {
        Owned got(MyResample2(src.get(), f));
        ASSERT_EQ(got->height, 3 * f + 1);
        for (int32_t y = 0; y < got->height; ++y)
            for (int32_t x = 0; x < 17; ++x) {
                const int32_t a = GetPixelIndex(src.get(), x, y / f), b = GetPixelIndex(src.get(), x, y / f + 1),
                              k = y % f;
                ASSERT_EQ(GetPixelIndex(got.get(), x, y), (a * (f - k) + b * k + (f + 1) / 2) / f) << f << "," << y;
            }
    }
    EXPECT_EQ(MyResample2(src.get(), 1), nullptr);
    EXPECT_EQ(MyResample2(src.get(), 50), nullptr);
    // One row is only copied.
    Image row = reshaped(src.get(), 17, 1);
    Owned copied(MyResample2(&row, 7));
    ASSERT_NE(copied, nullptr);
    EXPECT_TRUE(std::equal(src->bits, src->bits + 17, copied->bits) && copied->height == 1);
}

TEST(CheckMaxSame, RunsStartAtTheFirstLabelValue) {
    // Index 0 (the value of labels[0]) starts: the 1s never match it, the 0
    // at index 4 does; the last element ends a run uncounted.
    EXPECT_EQ(longest({0, 1, 1, 1, 0, 2, 2, 2, 2, 2, 3}), (Ints{4, 5, 10}));
    EXPECT_EQ(longest({1, -1, -1, -1, 2, 2}), (Ints{0, -9, -9})); // -1 never counts
    // A first value that is no index starts at index 0.
    EXPECT_EQ(longest({-3, -3, -3, 0}), (Ints{2, 0, 3}));
    // Two labels end their only run uncounted; fewer give no run at all.
    for (int32_t n : {-1, 0, 1, 2}) {
        int32_t first = -9, last = -9;
        EXPECT_EQ(CheckMaxSame(Ints{0, 0}.data(), n, &first, &last) + first + last, -18) << n;
    }
}

TEST(CombineMinSpace, MergesCloseIntervalsAndDropsShortOnes) {
    EXPECT_EQ(combine({0, 10, 12, 15, 30, 31, 40, 60}, 5), (Ints{0, 15, 40, 60}));
    // minGap 0 means 2; an absorbed interval's end is taken even when smaller.
    EXPECT_EQ(combine({0, 20, 3, 8, 40, 45, 46, 47}, 0), (Ints{0, 8, 40, 47}));
    // A length or a gap of exactly minGap is not below it: kept, not absorbed.
    EXPECT_EQ(combine({0, 5, 10, 12, 17, 22, 30, 35, 39, 40}, 5), (Ints{0, 5, 17, 22, 30, 40}));
    Ints kept = {0, 10};
    EXPECT_EQ(CombineMinSpace(kept.data(), -1, 5) + CombineMinSpace(kept.data(), 0, 5), 0);
    EXPECT_EQ(kept, (Ints{0, 10}));
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
    // An empty list (n of 0 or less) leaves the empty interval.
    int32_t s = 5, e = 9;
    EXPECT_EQ(CheckLapOver(list.data(), -1, &s, &e) + s + e, 0);
    EXPECT_EQ(lap({}, 5, 9), (Ints{0, 0, 0}));
}

// Planes wide enough to be straightened: the result is the resampled plane
// recognised in place, also where the boundary starts above the picture (dark
// specks tell where each row was read from).
TEST(MyResample2, StraightensLikeRecognizeYUV) {
    const int32_t cases[][4] = {{200, 30, 8, 10}, {700, 16, 200, 5}, {200, 75, 8, -3}, {200, 75, 8, -6}};
    std::vector<int32_t> line(700);
    int aboveThePicture = 0;
    for (auto [w, h, run, top] : cases)
        for (int32_t f : {2, 4}) {
            Owned src = tilted(w, h, run, top), want = make(w, f * (h - 1) + 1, 8);
            for (int32_t y = 0; y < h; ++y)
                for (int32_t x = 0; x < w; ++x)
                    if ((x * 7 + y * 13) % 11 == 0) src->bits[y * src->pitch + x] = 20;
            for (int32_t y = 0; y < want->height; ++y)
                for (int32_t x = 0; x < w; ++x) {
                    const int32_t a = GetPixelIndex(src.get(), x, y / f), k = y % f;
                    const int32_t b = k == 0 ? a : GetPixelIndex(src.get(), x, y / f + 1);
                    SetPixelIndex(want.get(), x, y, (a * (f - k) + b * k + (f + 1) / 2) / f);
                }
            pxfx::lines::detect_boundary(*pxfx::view_of(want.get()), line.data());
            aboveThePicture += line[0] < 0;
            ASSERT_EQ(RecognizeYUV(want.get(), nullptr), 1);
            Owned got(MyResample2(src.get(), f));
            ASSERT_NE(got, nullptr);
            EXPECT_EQ(diff(got.get(), want.get()), "") << w << "x" << h << " top " << top << " factor " << f;
        }
    EXPECT_GT(aboveThePicture, 0);
}
