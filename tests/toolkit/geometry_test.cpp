// Resize, crop, the region zoom on degenerate input and the small record
// helpers against straightforward per-pixel versions.
#include "toolkit/px_images.hpp"

using namespace pxtest;

namespace {

void ref_interp(const uint8_t *s, int sw, int sh, size_t ss, uint8_t *d, int dw, int dh, size_t ds, float ry,
                float rx) {
    for (int i = 0; i < dh; ++i) {
        const float fy = i / ry;
        const int y0 = int(fy), Y0 = clampi(y0, sh), Y1 = clampi(y0 + 1, sh);
        const float wy = fy - Y0;
        for (int j = 0; j < dw; ++j) {
            const float fx = j / rx;
            const int x0 = int(fx), X0 = clampi(x0, sw), X1 = clampi(x0 + 1, sw);
            const float wx = fx - x0;
            auto at = [&](int y, int x) { return s[(size_t(y) * sw + x) * ss]; };
            const float v =
                (1 - wy) * ((1 - wx) * at(Y0, X0) + wx * at(Y0, X1)) + wy * ((1 - wx) * at(Y1, X0) + wx * at(Y1, X1));
            d[(size_t(i) * dw + j) * ds] = uint8_t(v < 0 ? 0u : unsigned(v));
        }
    }
}

TEST(Resize, MatchesInvertedBilinearMappingAtEveryBitCount) {
    // The last two take rows past the widest vector loops; 26 x 22 to 13 x
    // 11 and 202 x 6 to 101 x 3 are ratios of exactly 2.
    const int sizes[][4] = {{1, 1, 3, 2}, {7, 5, 3, 9},     {13, 11, 26, 22}, {5, 1, 1, 5},     {9, 9, 4, 4},
                            {4, 4, 8, 8}, {100, 3, 151, 4}, {203, 4, 97, 3},  {26, 22, 13, 11}, {202, 6, 101, 3}};
    for (int bits : {8, 16, 24})
        for (const auto &s : sizes) {
            PX src = px_random(s[0], s[1], bits, 7u + bits);
            PX out(PXImage_Resize(src.get(), s[2], s[3]));
            ASSERT_TRUE(out && out->bitcount == (bits == 8 ? 8 : 24));
            const float ry = float(s[1]) / float(s[3]), rx = float(s[0]) / float(s[2]);
            const int ch = bits == 8 ? 1 : 3;
            // 16-bit sources are read with a three-byte stride, zero past the block.
            std::vector<uint8_t> packed(size_t(s[0]) * s[1] * ch, 0);
            std::memcpy(packed.data(), src->data, std::min(packed.size(), px_size(src.get())));
            std::vector<uint8_t> want(size_t(s[2]) * s[3] * ch);
            for (int c = 0; c < ch; ++c)
                ref_interp(packed.data() + c, s[0], s[1], ch, want.data() + c, s[2], s[3], ch, ry, rx);
            EXPECT_EQ(bytes(out.get()), want) << bits << " bits " << s[0] << "x" << s[1];
        }
    // The single-scale variant at scale 0: saturated coordinates.
    PX src = px_random(6, 5, 8, 1);
    std::vector<uint8_t> got(35);
    EXPECT_EQ(DualLinearIntepol_KWB(src->data, 6, 5, got.data(), 7, 5, 0.0f), 1);
    // At scale 2 the taps of a 9 x 7 result reach the source's last row and
    // column (held there); those of 10 x 8 and 11 x 9 go past them.
    for (int n : {9, 10, 11}) {
        std::vector<uint8_t> out(size_t(n) * (n - 2)), want(out.size());
        ASSERT_EQ(DualLinearIntepol_KWB(src->data, 5, 4, out.data(), n, n - 2, 2.0f), 1);
        ref_interp(src->data, 5, 4, 1, want.data(), n, n - 2, 1, 2.0f, 2.0f);
        EXPECT_EQ(out, want) << n;
    }
}

// Negative destination sizes leave empty loops (KWB refuses a width <= 0);
// negative source sizes would read before the plane. Nothing is written.
TEST(Resize, PlaneInterpolationOfDegenerateSizes) {
    const uint8_t src[16] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16};
    const struct {
        int32_t sw, sh, dw, dh, plain, kwb;
    } cases[] = {{4, 4, -2, 3, 1, 0},   {4, 4, 3, -2, 1, 1}, {4, 4, -2, -2, 1, 0},
                 {-4, 4, 3, 3, 0, 0},   {4, -4, 3, 3, 0, 0}, {-4, -4, 3, 3, 0, 0},
                 {-4, -4, 3, -1, 1, 1}, {0, 4, -3, 3, 0, 0}, {4, 4, 0, -3, 0, 0}};
    for (const auto &c : cases) {
        std::vector<uint8_t> dst(16, 0xAB);
        EXPECT_EQ(DualLinearIntepol(src, c.sw, c.sh, dst.data(), c.dw, c.dh), c.plain) << c.sw << "," << c.sh;
        EXPECT_EQ(DualLinearIntepol_KWB(src, c.sw, c.sh, dst.data(), c.dw, c.dh, 1.0f), c.kwb) << c.dw << "," << c.dh;
        EXPECT_EQ(dst, std::vector<uint8_t>(16, 0xAB));
    }
}

// Sizes that are empty, negative or beyond 32 bits, and crops of inverted
// rectangles: the record each call makes (the registry's contracts pin the
// results of degenerate sources).
TEST(Geometry, DegenerateSizesAndRectangles) {
    std::vector<uint8_t> block(4096, 9);
    const auto orig = block;
    const PXImage g8{9, 7, 8, block.data()}, g16{9, 7, 16, block.data()}, g24{9, 7, 24, block.data()},
        negH{9, -7, 16, block.data()}, minH{9, INT_MIN, 8, block.data()};
    const std::pair<std::function<PXImage *()>, const char *> cases[] = {
        {[&] { return PXImage_Resize(&g8, 0, 3); }, "0x3x8 none"},
        {[&] { return PXImage_Resize(&g24, 3, 0); }, "3x0x24 none"},
        {[&] { return PXImage_Resize(&g16, -3, 3); }, "-3x3x24 none"},
        {[&] { return PXImage_Resize(&g8, -70000, 3); }, "-70000x3x8 none"},
        {[&] { return PXImage_Resize(&g8, -3, -2); }, "-3x-2x8 zeros"},
        {[&] { return PXImage_Resize(&g24, -3, -2); }, "-3x-2x24 zeros"},
        {[&] { return PXImage_Resize(&g8, 70000, 70000); }, "null"},
        {[&] { return PXImage_Resize(&g8, INT_MIN, 3); }, "null"},
    };
    for (const auto &[call, want] : cases) {
        PX out(call());
        EXPECT_EQ(shape_of(out.get()), want);
    }
    // Crops: right < left, top < bottom and top = bottom - 1, then a negative
    // height (top and bottom held at -8) and a height of 2^31 + 2.
    const struct {
        const PXImage &src;
        PXRect r;
        const char *want;
    } crops[] = {{g8, {10, 3, 1, 1}, "0x3x8 none"},     {g8, {2, 1, 5, 4}, "8x-2x8 none"},
                 {g8, {2, 3, 5, 4}, "8x0x8 none"},      {negH, {1, -1, 3, 0}, "8x9x16 zeros"},
                 {negH, {1, 0, 3, -1}, "8x-7x16 none"}, {minH, {1, -1, 3, 0}, "null"}};
    for (const auto &c : crops) {
        PX out(PXImage_Crop(&c.src, &c.r));
        EXPECT_EQ(shape_of(out.get()), c.want) << c.r.left << "," << c.r.top << "," << c.r.right << "," << c.r.bottom;
    }
    EXPECT_EQ(block, orig);
}

TEST(Crop, RoundsWidthUpAndRunsIntoFollowingRows) {
    PX src = px_random(20, 6, 8, 5);
    PXRect r{6, 5, 14, 1}; // nine columns, rows 1..5, copies run past the row end
    PX out(PXImage_Crop(src.get(), &r));
    ASSERT_TRUE(out && out->width == 16 && out->height == 5);
    for (int k = 0; k < 5; ++k)
        for (int j = 0; j < 16; ++j) {
            const size_t from = size_t(1 + k) * 20 + 6 + j;
            EXPECT_EQ(out->data[k * 16 + j], from < 120 ? src->data[from] : 0) << k << "," << j;
        }
    PXRect wide{-5, 99, 99, -3};
    PX all(PXImage_Crop(src.get(), &wide));
    EXPECT_EQ(all->width, 20);
    EXPECT_EQ(bytes(all.get()), bytes(src.get()));
}

// Degenerate sources, rectangles and scales: the result, and whether the
// rectangle at (3, 4) of the target was cleared (nothing gathered) or left
// (the registry's contract pins sources without data and degenerate targets).
TEST(Zoom, RegionOfInterestOnDegenerateInput) {
    PX src = px_random(16, 12, 32, 8);
    std::vector<uint8_t> block(16 * 12 * 4, 5);
    const PXImage zeroW{0, 12, 32, block.data()}, negH{16, -12, 32, block.data()};
    const PXRect r{0, 8, 10, 0};
    const struct {
        const PXImage *from;
        PXRect rect;
        double scale;
        int32_t result;
        bool cleared;
    } cases[] = {
        {&zeroW, r, 2.0, 1, true},
        {&negH, r, 2.0, 1, true},
        {src.get(), r, -1.0, 1, true},             // w' = -9, h' = -7: nothing gathered
        {src.get(), {10, 0, 0, 8}, 2.0, 1, false}, // both sizes negative: nothing written
        {src.get(), {0, 0, 10, 8}, 2.0, 0, false}, // one negative size: no output plane
        {src.get(), {0, 8, 1, 0}, -1.0, 0, false}, // w' = 0: no gather plane
        {src.get(), r, 1e300, 0, false},           // w' = 0
        {src.get(), r, std::nan(""), 0, false},    // w' = 0
        {src.get(), {0, 0, 0, -8}, 1.0, 0, false}, // width 0
    };
    for (const auto &c : cases) {
        PX dst = px_make(30, 20, 32, 0xAA), want = px_clone(dst.get());
        for (int y = 4; y < 12 && c.cleared; ++y)
            std::memset(want->data + (y * 30 + 3) * 4, 0, 40);
        EXPECT_EQ(PXImage_ROI_Zoom(c.from, dst.get(), &c.rect, c.scale, 3, 4), c.result) << c.scale;
        EXPECT_EQ(bytes(dst.get()), bytes(want.get())) << c.scale;
    }
    // Targets running past the block and gathers past the source stay inside.
    PX dst = px_make(30, 20, 32, 0xAA);
    EXPECT_EQ(PXImage_ROI_Zoom(src.get(), dst.get(), &r, 0.5, 25, 18), 1);
}

TEST(Helpers, SimilaritySqrtAndPointInRect) {
    PX a = px_random(8, 3, 24, 1), b = px_clone(a.get()), words = px_random(4, 4, 16, 2);
    for (size_t i = 0; i < px_size(b.get()); i += 2) // mean difference exactly one half
        b->data[i] ^= 1;
    EXPECT_EQ(PXImage_IsSameImage(a.get(), b.get()) * 10 + PXImage_IsSameImage(words.get(), words.get()), 10);
    b->data[1] ^= 1;
    EXPECT_EQ(PXImage_IsSameImage(a.get(), b.get()), 0);
    // Without pixel rows the sum is 0: 1 when the byte count is 0 or positive.
    uint8_t block[64] = {};
    const std::pair<PXImage, int32_t> rowless[] = {{{0, 7, 24, block}, 1}, {{-3, -2, 32, block}, 1},
                                                   {{9, -7, 8, block}, 0}, {{INT_MIN, 7, 8, block}, 0},
                                                   {{0, 7, 16, block}, 0}, {{0, 7, 8, nullptr}, 0}};
    for (const auto &[im, want] : rowless)
        EXPECT_EQ(PXImage_IsSameImage(&im, &im), want) << im.width << "x" << im.height;

    for (int32_t n : {INT_MIN, -1, 0, 3, 4, 65535, 65536, 2147395599, 2147395600, 2147483647})
        EXPECT_EQ(px_sqrt(n), n > 0 ? int32_t(std::floor(std::sqrt(double(n)))) : 0) << n;

    const PXRect r{1, 5, 4, 2};
    const PXPoint points[] = {{2, 3}, {1, 3}, {4, 3}, {2, 2}, {2, 5}}; // inside, then the four edges
    for (const PXPoint &p : points)
        EXPECT_EQ(px_PtInRect(&p, &r), &p == points);
}

} // namespace

// Pixels of every width up to two words and a tail, in reverse order of
// rows and of pixels within a row.
TEST(Rotate, HalfTurnReversesRowsAndPixels) {
    for (int bits : {8, 16, 24})
        for (int w = 1; w <= 19; ++w) {
            PX src = px_random(w, 3, bits, 40u + w);
            PX out(PXImage_Rotate180(src.get()));
            ASSERT_TRUE(out);
            const size_t px = bits / 8;
            std::vector<uint8_t> want(px_size(src.get()));
            for (size_t i = 0; i < size_t(w) * 3; ++i)
                std::memcpy(&want[i * px], src->data + (size_t(w) * 3 - 1 - i) * px, px);
            EXPECT_EQ(bytes(out.get()), want) << bits << " bits, width " << w;
        }
}
