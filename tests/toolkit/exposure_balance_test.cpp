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
        PX im = percentile_image(bits), orig = px_clone(im.get());
        ASSERT_EQ(PXImage_AutoExposure(im.get()), 1);
        for (size_t i = 0; i < px_size(im.get()); ++i)
            ASSERT_EQ(im->data[i], curve(orig->data[i], 20, 180)) << i;
    }
    PX fixed = percentile_image(8);
    ASSERT_EQ(PXImage_AutoExposure_1(fixed.get()), 1);
    EXPECT_EQ(fixed->data[5], int(std::pow(20 / 255.0, 0.4) * 255.0));
    EXPECT_EQ(fixed->data[6], int(std::pow(100 / 255.0, 0.4) * 255.0));

    PX bright = px_make(10, 10, 8, 201);
    EXPECT_EQ(PXImage_AutoExposure(bright.get()), 0);
    EXPECT_EQ(PXImage_AutoExposure_1(bright.get()), 0);
    EXPECT_EQ(bytes(bright.get()), std::vector<uint8_t>(100, 201));
    PX mixed = percentile_image(24); // a bright first channel is left alone
    for (int i = 0; i < 1000; ++i)
        mixed->data[3 * i] = uint8_t(201 + i % 50);
    PX orig = px_clone(mixed.get());
    ASSERT_EQ(PXImage_AutoExposure(mixed.get()), 1);
    for (int i = 0; i < 3000; ++i)
        ASSERT_EQ(mixed->data[i], i % 3 ? curve(orig->data[i], 20, 180) : orig->data[i]) << i;

    PX flat = px_make(6, 6, 8, 100); // low = 100, high = 101
    EXPECT_EQ(PXImage_AutoExposure(flat.get()), 1);
    EXPECT_EQ(bytes(flat.get()), std::vector<uint8_t>(36, 0));
}

TEST(Exposure, SixteenBitTableCoversOnlyLowLevels) {
    PX img = px_make(50, 2, 16);
    for (int i = 0; i < 100; ++i) { // samples 0..99, then 40 of them lifted past 255
        const int v = i < 60 ? i : 256 + i;
        img->data[2 * i] = uint8_t(v);
        img->data[2 * i + 1] = uint8_t(v >> 8);
    }
    ASSERT_EQ(PXImage_AutoExposure(img.get()), 1);
    // low = 0; high = 256 + 99 = 355, kept as 99.
    for (int i = 0; i < 100; ++i) {
        const int got = img->data[2 * i] | img->data[2 * i + 1] << 8;
        const int want = i < 60 ? std::min(65535, int(std::pow(i / 99.0, 0.4) * 65535.0)) : 0;
        EXPECT_EQ(got, want) << i;
    }
    EXPECT_EQ(PXImage_AutoExposure(nullptr), 0);
    PX odd = px_random(3, 3, 32, 1);
    EXPECT_EQ(PXImage_AutoExposure_1(odd.get()), 0);
}

TEST(Otsu, ThresholdsOfKnownHistograms) {
    auto plane = [](std::initializer_list<std::pair<int, int>> levels) {
        std::vector<uint8_t> p;
        for (auto [v, count] : levels)
            p.insert(p.end(), size_t(count), uint8_t(v));
        return p;
    };
    const auto halves = plane({{50, 8}, {200, 8}}), quarter = plane({{10, 4}, {100, 12}});
    const auto ends = plane({{0, 5}, {255, 11}}), top = plane({{10, 4}, {240, 4}, {255, 8}});
    EXPECT_EQ(ProbabilityDensityValue(halves.data(), 4, 4), 50);
    EXPECT_EQ(ProbabilityDensityValue(quarter.data(), 8, 2), 10);
    EXPECT_EQ(ProbabilityDensityValue(ends.data(), 16, 1), 120);
    EXPECT_EQ(ProbabilityDensityValue(top.data(), 4, 4), 240); // level 255 is left out of the upper mean
    EXPECT_EQ(ProbabilityDensityValue(nullptr, 4, 4), 120);
    EXPECT_EQ(ProbabilityDensityValue(halves.data(), 0, 4), 120);
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
