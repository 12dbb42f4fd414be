// Free-form warp: weighted centres, hole filling on hand-made masks, and
// warps whose result is known: one pair, no pair, identity and translation.
#include "deform/free_form.hpp"
#include "support/test_images.hpp"

using namespace pxtest;

TEST(WeightedCentroid, RoundsTruncatesAndVanishes) {
    const int32_t pts[] = {1, 2, 5, 6, -3, -4};
    const double w[] = {1, 3, 2, 9e-7, NAN};
    auto at = [](PXPoint p) { return std::pair{p.x, p.y}; };
    EXPECT_EQ(at(WeightedCentroid(pts, w, 2)), std::pair(4, 5));           // 4.0 + 0.5 and 5.0 + 0.5
    EXPECT_EQ(at(WeightedCentroid(pts + 4, w + 2, 1)), std::pair(-2, -3)); // -2.5, -3.5 toward zero
    EXPECT_EQ(at(WeightedCentroid(pts, w + 3, 1)), std::pair(0, 0));       // weights below 1e-6
    EXPECT_EQ(at(WeightedCentroid(pts, w + 4, 1)), std::pair(0, 0));
}

TEST(FreeForm, HoleFillingReachAndOrder) {
    // One row, 0 and 200 known at x = 0 and 4, and 200 at x = 12: the gap
    // fills left to right (a tie takes the left alpha); x = 5 and 6 see
    // nothing within 5 to the right and keep their value.
    Owned row = make(13, 1, 32);
    const uint32_t in[] = {0x11000000, 0x22C8C8C8, 0x33C8C8C8}, want[] = {0x11323232, 0x11646464, 0x11969696};
    for (int x = 0; x < 13; ++x)
        SetPixelColor(row.get(), x, 0, x == 0 ? in[0] : x == 4 ? in[1] : x == 12 ? in[2] : 0x44000000);
    std::vector<uint8_t> m = {2, 0, 0, 0, 2, 0, 0, 0, 0, 0, 0, 0, 2};
    pxfx::fill_warp_holes(*pxfx::view_of(row.get()), m.data());
    for (int x = 1; x < 4; ++x)
        EXPECT_EQ(GetPixelColor(row.get(), x, 0), want[x - 1]) << x;
    EXPECT_EQ(GetPixelColor(row.get(), 5, 0), 0x44000000u);
    EXPECT_EQ(m, (std::vector<uint8_t>{2, 2, 2, 2, 2, 0, 0, 2, 2, 2, 2, 2, 2}));
    // A column, 1/3 of the way from 0 to 90, then halfway (a tie: the upper alpha).
    Owned col = make(1, 4, 32);
    SetPixelColor(col.get(), 0, 0, 0x01000000), SetPixelColor(col.get(), 0, 3, 0x025A5A5A);
    pxfx::fill_warp_holes(*pxfx::view_of(col.get()), std::vector<uint8_t>{2, 0, 0, 2}.data());
    EXPECT_EQ(GetPixelColor(col.get(), 0, 1), 0x011E1E1Eu);
    EXPECT_EQ(GetPixelColor(col.get(), 0, 2), 0x013C3C3Cu);
    // Four corners (the row below is empty, so d = 2) win over the row pair,
    // which would give 255; the alpha is the nearest corner's, the left one on
    // the tie l = r = 1 and the upper one as u = 1 < d = 2.
    Owned sq = make(3, 4, 32);
    const int cx[] = {0, 2, 0, 2}, cy[] = {0, 0, 2, 2};
    for (int i = 0; i < 4; ++i)
        SetPixelColor(sq.get(), cx[i], cy[i] + (i > 1), 0x01000000u * (i + 1) + 0x0A0A0A * (i + 1) + (i == 3));
    std::vector<uint8_t> all = {2, 2, 2, 2, 0, 2, 0, 0, 0, 2, 0, 2};
    pxfx::fill_warp_holes(*pxfx::view_of(sq.get()), all.data());
    EXPECT_EQ(GetPixelColor(sq.get(), 1, 1), 0x01161616u); // a = 1/2, b = 1/3: 22.33 and 22.17
    // Blends round half up: corners (red, green, blue) (10, 10, 10), (13, 10,
    // 11), (10, 10, 10), (12, 11, 11) give the pair 11.5, 10, 10.5 at (1, 0)
    // and the four corners 11.25, 10.25, 10.5 at (1, 1).
    Owned half = make(3, 3, 32);
    const uint32_t corner[] = {0x0A0A0A, 0x0D0A0B, 0x0A0A0A, 0x0C0B0B};
    for (int i = 0; i < 4; ++i)
        SetPixelColor(half.get(), cx[i], cy[i], corner[i]);
    pxfx::fill_warp_holes(*pxfx::view_of(half.get()), std::vector<uint8_t>{2, 0, 2, 0, 0, 0, 2, 0, 2}.data());
    EXPECT_EQ(GetPixelColor(half.get(), 1, 0), 0x0C0A0Bu);
    EXPECT_EQ(GetPixelColor(half.get(), 1, 1), 0x0B0A0Bu);
}

TEST(FreeForm, OnePairIdentityTranslationAndIgnoredPairs) {
    Owned src = random_image(20, 15, 32, 4);
    SetPixelColor(src.get(), 0, 0, 0x12340056); // green 0: black background
    Slot dst;
    // One pair: every pixel lands on the target, which keeps the last pixel
    // mapped (the source point is not mapped, the last column is never
    // written); without pairs every pixel lands on (0, 0).
    const DeformationPair one[] = {{3.7, 4.2, 10.9, 6}, {19.5, 14.2, 10, 6}, {3, 4, 19, 6}, {3, 4, 19, 6}};
    const int want[][5] = {{1, 10, 6, 19, 14}, {1, 10, 6, 18, 14}, {1, 19, 6, 3, 4}, {0, 0, 0, 19, 14}};
    for (int i = 0; i < 4; ++i) { // count, place written, source pixel found there
        const auto [n, qx, qy, sx, sy] = want[i];
        ASSERT_EQ(DeformationImage(src.get(), &one[i], uint32_t(n), &dst), 1);
        for (int y = 0; y < 15; ++y)
            for (int x = 0; x < 20; ++x)
                EXPECT_EQ(GetPixelColor(dst.get(), x, y), x == qx && y == qy ? GetPixelColor(src.get(), sx, sy) : 0u);
    }
    // Identity pairs, then the same shifted by (3, 2): the picture moves along,
    // on a white background, never into the last row and column.
    SetPixelColor(src.get(), 0, 0, 0x00000100);
    DeformationPair pairs[] = {{2, 2, 2, 2},     {15, 3, 15, 3}, {4, 11, 4, 11},
                               {13, 11, 13, 11}, {NAN, 1, 1, 1}, {1, 1, 1, 1e300}};
    for (int t : {0, 1}) {
        ASSERT_EQ(DeformationImage(src.get(), pairs, 6, &dst), 1);
        for (int y = 0; y < 15; ++y)
            for (int x = 0; x < 20; ++x) {
                const bool moved = x >= 3 * t && y >= 2 * t && x < 19 && y < 14;
                EXPECT_EQ(GetPixelColor(dst.get(), x, y), moved ? GetPixelColor(src.get(), x - 3 * t, y - 2 * t) : ~0u);
            }
        for (int i = 0; i < 4; ++i)
            pairs[i].dstX += 3, pairs[i].dstY += 2;
    }
}
