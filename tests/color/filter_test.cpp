// Kernel convolution against a straightforward accessor version on random
// pictures of every format, the fixed-kernel effects and the matrixX table.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

struct Params {
    std::vector<int32_t> kernel;
    int32_t size, divisor, offset, gray;
};

int32_t finish(uint32_t sum, int32_t divisor, int32_t offset) {
    const int64_t q = divisor != 0 ? int64_t(int32_t(sum)) / divisor : int32_t(sum);
    return int32_t(std::clamp<int64_t>(q + offset, 0, 255));
}

// Filter into d, pixel by pixel with the accessors.
void reference_filter(const Image *src, const Params &p, const Image *mask, Image *d) {
    int32_t w = d->width, h = d->height;
    if (mask && mask->bitCount == 8) w = std::min(w, mask->width), h = std::min(h, mask->height);
    const int32_t half = p.size / 2, last = p.size - half - 1;
    auto weight = [&](int dx, int dy) { return uint32_t(p.kernel[size_t((dy + half) * p.size + dx + half)]); };
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            if (d->bitCount == 8) {
                if (mask && y < mask->height && x < int32_t(mask->pitch) && mask->bits[y * mask->pitch + x] == 0) {
                    SetPixelIndex(d, x, y, GetPixelIndex(src, x, y));
                    continue;
                }
                uint32_t sum = 0;
                for (int dy = -half; dy <= last; ++dy)
                    for (int dx = -half; dx <= last; ++dx)
                        sum += weight(dx, dy) * GetPixelIndex(src, x + dx, y + dy);
                SetPixelIndex(d, x, y, finish(sum, p.divisor == 0 ? 1 : p.divisor, p.offset));
            } else if (d->bitCount == 24 || d->bitCount == 32) {
                uint32_t s[3] = {0, 0, 0}, c = GetPixelColor(d, x, y);
                for (int dx = -half; dx <= last; ++dx)
                    for (int dy = -half; dy <= last; ++dy) {
                        c = GetPixelColor(src, x + dx, y + dy);
                        for (int i = 0; i < 3; ++i)
                            s[i] += weight(dx, dy) * ((c >> (8 * i)) & 255);
                    }
                uint32_t v[3];
                for (int i = 0; i < 3; ++i)
                    v[i] = uint32_t(finish(s[i], p.divisor, p.offset));
                if (p.gray >= 1) v[0] = v[1] = v[2] = (v[0] + 2 * v[1] + v[2]) >> 2;
                SetPixelColor(d, x, y, v[0] | v[1] << 8 | v[2] << 16 | (c & 0xFF000000u));
            }
        }
}

Params random_params(std::mt19937 &rng, int32_t size) {
    Params p{{}, size, 0, 0, 0};
    for (int32_t i = 0; i < size * size; ++i)
        p.kernel.push_back(rng() % 3 == 0 ? 0 : int32_t(rng() % 21) - 8);
    const int32_t divisors[] = {0, 1, 9, -3};
    p.divisor = divisors[rng() % 4];
    p.offset = int32_t(rng() % 60) - 20;
    p.gray = int32_t(rng() % 3) - 1;
    return p;
}

const int32_t kSizes[][2] = {{1, 1}, {1, 6}, {6, 1}, {2, 3}, {7, 5}, {13, 9}};

} // namespace

TEST(Filter, MatchesAccessorVersionIntoDestination) {
    std::mt19937 rng(5);
    uint32_t seed = 1;
    for (int32_t sbc : kBitCounts)
        for (int32_t dbc : kBitCounts)
            for (auto [w, h] : kSizes)
                for (int32_t size : {1, 2, 3, 4, 5}) {
                    const Params p = random_params(rng, size);
                    Owned src = random_image(w, h, sbc, seed++);
                    Owned dst = random_image(w, h, dbc, seed++);
                    Owned want = clone(dst.get());
                    reference_filter(src.get(), p, nullptr, want.get());
                    ASSERT_EQ(Filter(src.get(), p.kernel.data(), size, p.divisor, p.offset, nullptr, dst.get(), p.gray),
                              1);
                    ASSERT_EQ(diff(dst.get(), want.get()), "")
                        << sbc << "->" << dbc << " " << w << "x" << h << " k" << size;
                }
}

TEST(Filter, InPlaceMasksAndOddDestinations) {
    std::mt19937 rng(9);
    uint32_t seed = 500;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t maskBits : {0, 8, 24}) {
                const Params p = random_params(rng, int32_t(rng() % 4) + 1);
                Owned src = random_image(w, h, bc, seed++);
                Owned mask = maskBits ? random_image(w / 2 + 1, h + 1, maskBits, seed++) : nullptr;
                if (mask) std::fill(mask->bits, mask->bits + 3, uint8_t(0)); // some pixels deselected
                // In place: the untouched working image is copied back.
                Owned work = make(w, h, bc);
                reference_filter(src.get(), p, mask.get(), work.get());
                Owned want = clone(src.get());
                PX_Img_Copy(want.get(), work.get());
                Owned got = clone(src.get());
                ASSERT_EQ(Filter(got.get(), p.kernel.data(), p.size, p.divisor, p.offset, mask.get(), nullptr, p.gray),
                          1);
                ASSERT_EQ(diff(got.get(), want.get()), "") << bc << " " << w << "x" << h << " mask " << maskBits;
                // A destination larger than the source reads the source clamped.
                Owned big = random_image(w + 3, h + 2, bc == 16 ? 32 : bc, seed++);
                Owned bigWant = clone(big.get());
                reference_filter(src.get(), p, mask.get(), bigWant.get());
                ASSERT_EQ(
                    Filter(src.get(), p.kernel.data(), p.size, p.divisor, p.offset, mask.get(), big.get(), p.gray), 1);
                ASSERT_EQ(diff(big.get(), bigWant.get()), "") << bc << " larger destination";
            }
}

TEST(Filter, KernelsLargerThanThePictureAndWrappingSums) {
    std::mt19937 rng(11);
    for (int32_t bc : {8, 32}) {
        Owned src = random_image(3, 2, bc, 40);
        Params p = random_params(rng, 9);
        Owned dst = make(3, 2, bc), want = make(3, 2, bc);
        reference_filter(src.get(), p, nullptr, want.get());
        ASSERT_EQ(Filter(src.get(), p.kernel.data(), 9, p.divisor, p.offset, nullptr, dst.get(), 0), 1);
        EXPECT_EQ(diff(dst.get(), want.get()), "");
        // Weights whose sums leave 32 bits wrap as 32-bit integers do.
        p = {{INT32_MAX, INT32_MIN, 0x40000000, -7}, 2, -1, 100, 0};
        want = make(3, 2, bc), dst = make(3, 2, bc);
        reference_filter(src.get(), p, nullptr, want.get());
        ASSERT_EQ(Filter(src.get(), p.kernel.data(), 2, p.divisor, p.offset, nullptr, dst.get(), 0), 1);
        EXPECT_EQ(diff(dst.get(), want.get()), "");
    }
}

TEST(Filter, NamedBehaviours) {
    // A 1 x 1 identity kernel copies.
    const int32_t one = 1;
    Owned src = random_image(7, 4, 24, 1), dst = make(7, 4, 24);
    ASSERT_EQ(Filter(src.get(), &one, 1, 1, 0, nullptr, dst.get(), 0), 1);
    EXPECT_EQ(diff(dst.get(), src.get()), "");
    // No taps: the clamped offset everywhere, 32-bit alpha kept.
    Owned a32 = random_image(4, 4, 32, 2);
    const uint32_t alpha = GetPixelColor(a32.get(), 1, 2) >> 24;
    ASSERT_EQ(Filter(src.get(), nullptr, 0, 0, 300, nullptr, a32.get(), 0), 1);
    EXPECT_EQ(GetPixelColor(a32.get(), 1, 2), alpha << 24 | 0xFFFFFFu);
    // A 16-bit picture filtered in place turns white.
    Owned w16 = random_image(5, 3, 16, 3);
    ASSERT_EQ(Filter(w16.get(), &one, 1, 1, 0, nullptr, nullptr, 0), 1);
    EXPECT_EQ(GetPixelColor(w16.get(), 4, 2), 0x00F8FCF8u);
    // Refusals.
    Image hollow = *src;
    hollow.bits = nullptr;
    EXPECT_EQ(Filter(nullptr, &one, 1, 1, 0, nullptr, nullptr, 0), 0);
    EXPECT_EQ(Filter(&hollow, &one, 1, 1, 0, nullptr, nullptr, 0), 0);
    EXPECT_EQ(Filter(src.get(), nullptr, 3, 1, 0, nullptr, nullptr, 0), 0);
    EXPECT_EQ(Filter(src.get(), &one, 1, 1, 0, nullptr, &hollow, 0), 0);
    EXPECT_EQ(Filter(src.get(), &one, 50000, 1, 0, nullptr, nullptr, 0), 0);
    // A destination sharing the source's pixels is filtered from a snapshot.
    const Params shift{{1, 0, 0, 0, 0, 0, 0, 0, 0}, 3, 1, 0, 0}; // each pixel takes its upper-left neighbour
    Owned same = random_image(6, 5, 8, 4), want = make(6, 5, 8);
    reference_filter(same.get(), shift, nullptr, want.get());
    ASSERT_EQ(Filter(same.get(), shift.kernel.data(), 3, 1, 0, nullptr, same.get(), 0), 1);
    EXPECT_EQ(diff(same.get(), want.get()), "");
}

TEST(KernelEffects, MatchFilterAndKeepTheirRules) {
    const Params blur{{1, 1, 1, 1, 1, 1, 1, 1, 1}, 3, 9, 0, 0}, soften{{1, 1, 1, 1, 8, 1, 1, 1, 1}, 3, 16, 0, 0},
        sharpen{{-1, -1, -1, -1, 15, -1, -1, -1, -1}, 3, 7, 0, 0}, emboss{{0, 0, -1, 0, 0, 0, 1, 0, 0}, 3, 0, 127, 1};
    int32_t (*const fns[])(const Image *, Image **) = {PX_IMG_Blur, PX_IMG_Soften, PX_IMG_Sharpen, PX_IMG_Emboss1};
    const Params *params[] = {&blur, &soften, &sharpen, &emboss};
    uint32_t seed = 70;
    for (int32_t bc : kBitCounts)
        for (int i = 0; i < 4; ++i) {
            Owned src = random_image(9, 6, bc, seed++);
            Slot out;
            ASSERT_EQ(fns[i](src.get(), &out), 1);
            Owned want = make(9, 6, bc);
            reference_filter(src.get(), *params[i], nullptr, want.get());
            EXPECT_EQ(diff(out.get(), want.get()), "") << i << " @" << bc;
        }
    // Uniform pictures: the blur keeps them, the relief is flat 127.
    Owned flat = filled(6, 5, 24, 0x00336699);
    Slot out;
    ASSERT_EQ(PX_IMG_Blur(flat.get(), &out), 1);
    EXPECT_EQ(diff(out.get(), flat.get()), "");
    Image *kept = out.get();
    ASSERT_EQ(PX_IMG_Emboss1(flat.get(), &out), 1);
    EXPECT_EQ(out.get(), kept);
    EXPECT_EQ(GetPixelColor(out.get(), 3, 2), 0xFF7F7F7Fu);
    // 32-bit blur: alpha of the lower-right neighbour, clamped.
    Owned a = filled(4, 3, 32, 0x10203040);
    SetPixelColor(a.get(), 3, 2, 0x99203040);
    SetPixelColor(a.get(), 2, 1, 0x55203040);
    ASSERT_EQ(PX_IMG_Blur(a.get(), &out), 1);
    EXPECT_EQ(GetPixelColor(out.get(), 1, 0) >> 24, 0x55u);
    EXPECT_EQ(GetPixelColor(out.get(), 3, 2) >> 24, 0x99u);
    EXPECT_EQ(GetPixelColor(out.get(), 2, 2) >> 24, 0x99u);
    EXPECT_EQ(GetPixelColor(out.get(), 0, 0) >> 24, 0x10u);
    EXPECT_EQ(PX_IMG_Sharpen(a.get(), nullptr), 0);
    EXPECT_EQ(PX_IMG_Soften(nullptr, &out), 0);
}

TEST(MatrixX, NormalisedSymmetricGaussians) {
    const float listed[4][11] = {{0.010868f, 0.978265f},
                                 {0.006646f, 0.194226f, 0.598257f},
                                 {0.004433f, 0.054006f, 0.242036f, 0.399050f},
                                 {0.001332f, 0.003131f, 0.006729f, 0.013216f, 0.023722f, 0.038916f, 0.058347f,
                                  0.079951f, 0.100124f, 0.114596f, 0.119871f}};
    const int rows[4] = {1, 2, 3, 10};
    for (int i = 0; i < 4; ++i)
        for (int j = 0; j <= rows[i]; ++j)
            EXPECT_NEAR(matrixX[rows[i] - 1][j], listed[i][j], 6e-7) << rows[i] << " " << j;
    for (int r = 1; r <= 10; ++r) {
        double sum = 0;
        for (int j = 0; j < 21; ++j) {
            sum += matrixX[r - 1][j];
            if (j > 2 * r) {
                EXPECT_EQ(matrixX[r - 1][j], 0.0f);
            } else {
                EXPECT_EQ(matrixX[r - 1][j], matrixX[r - 1][2 * r - j]);
                if (j > 0 && j <= r) {
                    EXPECT_GT(matrixX[r - 1][j], matrixX[r - 1][j - 1]);
                }
            }
        }
        EXPECT_NEAR(sum, 1.0, 1e-6) << r;
        // Each entry is the nearest float to the double-precision value.
        const double s = r / 3.0;
        double total = 0;
        for (int i = -r; i <= r; ++i)
            total += std::exp(-(i * i) / (2 * s * s));
        EXPECT_EQ(matrixX[r - 1][r], float(1.0 / total)) << r;
    }
}
