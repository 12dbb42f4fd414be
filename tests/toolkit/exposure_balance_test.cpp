// Exposure, Otsu threshold, white balance and the channel operations.
#include <gtest/gtest.h>

#include <cmath>

#include "toolkit/px_images.hpp"

using namespace pxtest;

namespace {

// 1000 samples per channel: 5 at 0 (exactly 0.5 %, not above), 1 at 20, 989 at 100 (cumulative
// share exactly 99.5 %) and 5 at 180, so low = 20 and high = 180.
PX percentile_image(int bits) {
    PX im = px_make(100, 10, bits);
    const int ch = bits / 8;
    for (int i = 0; i < 1000 * ch; ++i)
        im->data[i] = uint8_t(i / ch < 5 ? 0 : i / ch == 5 ? 20 : i / ch < 995 ? 100 : 180);
    return im;
}

int curve(int v, int low, int high) {
    const double p = std::pow(double(v - low) / (high - low), 0.4);
    return std::isnan(p) ? 0 : std::min(255, int(p * 255.0));
}

TEST(Exposure, PercentileStretchAndBrightRefusal) {
    for (int bits : {8, 24}) {
        PX im = percentile_image(bits);
        for (int i = 0; i < 1000 && bits == 24; ++i) // a bright first channel is left alone
            im->data[3 * i] = uint8_t(201 + i % 50);
        PX orig = px_clone(im.get());
        ASSERT_EQ(PXImage_AutoExposure(im.get()), 1);
        for (size_t i = 0; i < px_size(im.get()); ++i)
            ASSERT_EQ(im->data[i], bits == 24 && i % 3 == 0 ? orig->data[i] : curve(orig->data[i], 20, 180)) << i;
    }
    PX fixed = percentile_image(8), bright = px_make(10, 10, 8, 201), flat = px_make(6, 6, 8, 100);
    ASSERT_EQ(PXImage_AutoExposure_1(fixed.get()), 1); // a fixed low of 0 and high of 255
    EXPECT_EQ(fixed->data[5] * 1000 + fixed->data[6], curve(20, 0, 255) * 1000 + curve(100, 0, 255));
    EXPECT_EQ(PXImage_AutoExposure(bright.get()) + PXImage_AutoExposure_1(bright.get()), 0);
    EXPECT_EQ(bytes(bright.get()), std::vector<uint8_t>(100, 201));
    EXPECT_EQ(PXImage_AutoExposure(flat.get()), 1); // low = 100, high = 101
    EXPECT_EQ(bytes(flat.get()), std::vector<uint8_t>(36, 0));
}

TEST(Exposure, SixteenBitTableCoversOnlyLowLevels) {
    PX img = px_make(50, 2, 16), odd = px_random(3, 3, 32, 1);
    for (int i = 0; i < 100; ++i) // samples 0..99, then 40 of them lifted past 255
        put_sample(img.get(), i / 50, i % 50, 0, i < 60 ? i : 256 + i);
    ASSERT_EQ(PXImage_AutoExposure(img.get()), 1);
    for (int i = 0; i < 100; ++i) // low = 0; high = 256 + 99 = 355, kept as 99.
        EXPECT_EQ(neighbour(img.get(), i / 50, i % 50, 0, 0, 0),
                  i < 60 ? std::min(65535, int(std::pow(i / 99.0, 0.4) * 65535.0)) : 0)
            << i;
    EXPECT_EQ(PXImage_AutoExposure(nullptr) + PXImage_AutoExposure_1(odd.get()), 0);
}

// Otsu's split with level 255 left out of the upper mean; 120 when there is nothing to split.
TEST(Otsu, TopLevelAndDegenerateInputs) {
    std::vector<uint8_t> top(16, 255), ends(16, 255);
    std::fill_n(top.begin(), 8, 240);
    std::fill_n(top.begin(), 4, 10);
    std::fill_n(ends.begin(), 5, 0);
    EXPECT_EQ(ProbabilityDensityValue(top.data(), 4, 4), 240);
    EXPECT_EQ(ProbabilityDensityValue(ends.data(), 16, 1) + ProbabilityDensityValue(nullptr, 4, 4) +
                  ProbabilityDensityValue(top.data(), 0, 4),
              3 * 120);
}

// Literal white balance with the column walk stopped after three columns.
PX ref_balance(const PXImage *src, int x, int y) {
    PX out = px_clone(src);
    const int w = src->width, h = src->height, ch = src->bitcount / 8;
    const size_t n = size_t(w) * h;
    for (int b = 0; b < ch; ++b) {
        int sum = 0;
        for (int i = 0, r = y - 1; i < 3; ++i) {
            const int R = clampi(r, h);
            for (int j = 0, c = x - 1; j < 3 && c <= x + 1; ++j) {
                const int C = clampi(c, w);
                const size_t k = ch == 3 ? size_t(R * w + C) * 3 + b : size_t(R * w + C * 3 + 1);
                sum += k < px_size(src) ? src->data[k] : 0;
                c = C + 1;
            }
            r = R + 1;
        }
        const int ref = std::min(255, std::max(1, (2 * sum + 9) / 18));
        bool scale = 128 < ref && ref < 250;
        if (ch == 3) {
            std::vector<uint8_t> plane(n);
            for (size_t i = 0; i < n; ++i)
                plane[i] = src->data[3 * i + b];
            scale = ref < 250 && ProbabilityDensityValue(plane.data(), w, h) < ref;
        }
        for (size_t i = 0; i < n; ++i) {
            const int v = src->data[i * ch + b];
            out->data[i * ch + b] = uint8_t(std::min(250, scale ? (500 * v + ref) / (2 * ref) : v));
        }
    }
    return out;
}

TEST(WhiteBalance, MatchesLiteralVersionAtEdgesAndCorners) {
    for (int bits : {8, 24})
        for (uint32_t seed = 1; seed <= 3; ++seed) {
            const int w = 9, h = 7;
            PX src = px_random(w, h, bits, seed);
            for (size_t i = 0; i < px_size(src.get()); ++i) // lift some references into the gate
                src->data[i] = uint8_t(std::max<int>(src->data[i], int(seed) * 60));
            const PXPoint pts[] = {{4, 3}, {0, 0}, {w - 1, h - 1}, {w + 5, -3}, {-7, h + 2}, {w - 2, 0}};
            for (const PXPoint &pt : pts) {
                PX img = px_clone(src.get());
                ASSERT_EQ(PXImage_AutoWhiteBalance(img.get(), &pt), 1);
                EXPECT_EQ(bytes(img.get()), bytes(ref_balance(src.get(), pt.x, pt.y).get()))
                    << bits << " bits at " << pt.x << "," << pt.y;
            }
        }
    PX white = px_make(5, 5, 24, 253);
    const PXPoint mid{2, 2};
    ASSERT_EQ(PXImage_AutoWhiteBalance(white.get(), &mid), 1);
    EXPECT_EQ(bytes(white.get()), std::vector<uint8_t>(75, 250));
    EXPECT_EQ(PXImage_AutoWhiteBalance(white.get(), nullptr), 0);
}

TEST(Channels, InversionAndGreenCopy) {
    PX rgba = px_random(4, 3, 32, 10), a0 = px_clone(rgba.get());
    PX rgb = px_random(4, 3, 24, 9), r0 = px_clone(rgb.get());
    EXPECT_EQ(PXImage_BlueEnhancement(rgba.get()), 0);
    ASSERT_EQ(PXImage_BlueEnhancement(rgb.get()), 1);
    ASSERT_EQ(PXImage_GreenChannel(rgba.get()), 1);
    for (int i = 0; i < 36; ++i)
        EXPECT_EQ(rgb->data[i], 255 - r0->data[i]);
    for (int i = 0; i < 12; ++i) {
        const uint8_t *p = rgba->data + 4 * i, *q = a0->data + 4 * i;
        EXPECT_TRUE(p[0] == q[1] && p[1] == q[1] && p[2] == q[1] && p[3] == q[3]);
    }
}

} // namespace
