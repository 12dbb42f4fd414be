// Straightening along a tilted boundary, RecognizeYUV's limits and delivery,
// and the vertical resampler against its formula.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "lines/lines_internal.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

namespace {

// Dark (20) above the boundary row top + x / run, bright (230) from it down.
Owned tilted(int32_t w, int32_t h, int32_t run = 8, int32_t top = 30) {
    Owned im = make(w, h, 8);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            im->bits[y * im->pitch + x] = y < top + x / run ? 20 : 230;
    return im;
}

} // namespace

TEST(Straighten, TiltedBoundaryBecomesTheTopRow) {
    Owned im = tilted(200, 100);
    std::vector<int32_t> line(200);
    pxfx::lines::detect_boundary(im.get(), line.data());
    // Strip boundaries: row 38 at column 65, row 48 at column 145.
    for (int32_t c = 0; c < 200; ++c)
        ASSERT_EQ(line[c], 38 + (c - 65) / 8) << c;
    Owned res = make(200, 100, 8);
    pxfx::lines::straighten(im.get(), line.data(), res.get());
    // 100 - line[199] = 46 rows are filled; the boundary lies on row 0 or 1.
    for (int32_t r = 0; r < 100; ++r)
        for (int32_t c = 0; c < 200; ++c) {
            const uint8_t v = res->bits[r * res->pitch + c];
            if (r == 0)
                ASSERT_TRUE(v == 20 || v == 230);
            else
                ASSERT_EQ(v, r < 46 ? 230 : 255) << r << "," << c;
        }
}

TEST(Straighten, MatchesClampedReadsForSteepAndLevelLines) {
    const int32_t cases[][4] = {{200, 100, 8, 30}, {700, 60, 200, 20}, {200, 150, 2, -10}};
    for (auto [w, h, run, top] : cases) {
        Owned im = tilted(w, h, run, top);
        std::vector<int32_t> line(static_cast<size_t>(w));
        pxfx::lines::detect_boundary(im.get(), line.data());
        if (top < 0) {
            EXPECT_LT(line[0], 0); // the clamped rows are reached
        }
        Owned got = make(w, h, 8), want = make(w, h, 8);
        pxfx::lines::straighten(im.get(), line.data(), got.get());
        const int32_t rows = std::min(h - line[0], h - line[w - 1]);
        for (int32_t r = 0; r < rows; ++r)
            for (int32_t c = 0; c < w; ++c)
                SetPixelIndex(want.get(), c, r, GetPixelIndex(im.get(), c, line[c] + r));
        EXPECT_EQ(diff(got.get(), want.get()), "") << w << "x" << h;
    }
}

TEST(Straighten, EdgeAtColumn65ShiftsTheLineToTheLastSearchedRow) {
    Owned im = tilted(200, 100);
    // Rows 30 (top) and 31 of column 65 now form an upward edge.
    im->bits[31 * im->pitch + 65] = 230;
    std::vector<int32_t> line(200);
    pxfx::lines::detect_boundary(im.get(), line.data());
    // Mean distance from row 48 + 6 to the line over columns 65..144 is 11.5.
    for (int32_t c = 0; c < 200; ++c)
        ASSERT_EQ(line[c], 50 + (c - 65) / 8) << c;
}

TEST(RecognizeYUV, RefusesPlanesSmallerThanItsStripsAndDelivers) {
    EXPECT_EQ(RecognizeYUV(tilted(120, 100).get(), nullptr), 0);
    EXPECT_EQ(RecognizeYUV(tilted(200, 12).get(), nullptr), 0);
    EXPECT_EQ(RecognizeYUV(make(200, 100, 24).get(), nullptr), 0);
    EXPECT_EQ(RecognizeYUV(nullptr, nullptr), 0);
    for (auto [w, h] : {std::pair{121, 13}, {131, 40}, {200, 100}}) {
        Owned im = random_image(w, h, 8, static_cast<uint32_t>(w));
        Owned inPlace = clone(im.get());
        ASSERT_EQ(RecognizeYUV(inPlace.get(), nullptr), 1);
        Slot handed;
        ASSERT_EQ(RecognizeYUV(im.get(), &handed), 1);
        EXPECT_EQ(diff(handed.get(), inPlace.get()), "");
        Slot given;
        given.image = malloc_Image(w, h, 8);
        Image *kept = given.get();
        ASSERT_EQ(RecognizeYUV(im.get(), &given), 1);
        EXPECT_EQ(given.get(), kept);
        EXPECT_EQ(diff(given.get(), inPlace.get()), "");
    }
    Owned im = tilted(200, 100);
    Slot out;
    ImgDecode(im.get(), &out);
    EXPECT_NE(out.get(), nullptr);
    ImgDecode(nullptr, &out);
}

TEST(MyResample2, InterpolatesRowsWithRounding) {
    // Narrower than RecognizeYUV accepts, so the result is the resampling.
    Owned src = random_image(17, 4, 8, 3);
    for (int32_t f = 2; f <= 49; ++f) {
        Owned got(MyResample2(src.get(), f));
        ASSERT_NE(got, nullptr);
        ASSERT_EQ(got->height, 3 * f + 1);
        for (int32_t y = 0; y < got->height; ++y)
            for (int32_t x = 0; x < 17; ++x) {
                const int32_t sy = y / f, k = y % f;
                const int32_t a = src->bits[sy * src->pitch + x];
                const int32_t b = k == 0 ? a : src->bits[(sy + 1) * src->pitch + x];
                ASSERT_EQ(got->bits[y * got->pitch + x], (a * (f - k) + b * k + (f + 1) / 2) / f) << f << "," << y;
            }
    }
    // Wide enough: the resampled plane is recognised in place.
    Owned wide = random_image(130, 5, 8, 4);
    Owned res(MyResample2(wide.get(), 3));
    ASSERT_NE(res, nullptr);
    EXPECT_EQ(res->height, 13);
    EXPECT_EQ(MyResample2(src.get(), 1), nullptr);
    EXPECT_EQ(MyResample2(src.get(), 50), nullptr);
    EXPECT_EQ(MyResample2(make(4, 4, 24).get(), 2), nullptr);
    EXPECT_EQ(MyResample2(nullptr, 2), nullptr);
}

TEST(EmptyEntryPoints, DoNothing) {
    ImgLineDecode();
    CheckAvailableBlock();
    RebuildImg();
}
