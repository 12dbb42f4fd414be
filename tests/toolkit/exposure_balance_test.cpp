// Exposure, Otsu threshold, white balance and the channel operations.
#include <gtest/gtest.h>

#include <cmath>

#include "toolkit/px_images.hpp"

using namespace pxtest;

namespace {

// Stretch table of one channel's histogram, or identity when it is bright.
std::vector<int> ref_stretch(const std::vector<uint32_t> &h, double n, bool fixed, bool *bright) {
    uint64_t cum = 0;
    int low = 0, high = 255, v = 0;
    for (; v < 256; ++v)
        if (double(cum += h[v]) / n > 0.005) break;
    low = v < 256 ? v : 0;
    for (v = low + 1; v < 256; ++v)
        if (double(cum += h[v]) / n > 0.995) break;
    high = v < 256 ? v : 255;
    *bright = low >= 201;
    std::vector<int> t(256);
    for (int i = 0; i < 256; ++i) {
        const double p = fixed ? std::pow(i / 255.0, 0.4) : std::pow(double(i - low) / double(high - low), 0.4);
        t[i] = *bright ? i : std::isnan(p) ? 0 : std::min(255, std::max(0, int(p * 255.0)));
    }
    return t;
}

void check_exposure(PX img, bool fixed) {
    const int ch = img->bitcount / 8;
    const size_t n = size_t(img->width) * img->height;
    PX want = px_clone(img.get());
    bool anyBright = false;
    for (int c = 0; c < ch; ++c) {
        std::vector<uint32_t> h(256);
        for (size_t i = 0; i < n; ++i)
            ++h[img->data[i * ch + c]];
        bool bright;
        const auto t = ref_stretch(h, double(n), fixed && ch == 1, &bright);
        anyBright |= bright;
        for (size_t i = 0; i < n; ++i)
            want->data[i * ch + c] = uint8_t(t[img->data[i * ch + c]]);
    }
    const int r = fixed ? PXImage_AutoExposure_1(img.get()) : PXImage_AutoExposure(img.get());
    EXPECT_EQ(r, ch == 1 && anyBright ? 0 : 1);
    EXPECT_EQ(bytes(img.get()), bytes(want.get()));
}

PX ranged(int w, int h, int bits, int lo, int hi, uint32_t seed) {
    PX im = px_random(w, h, bits, seed);
    for (size_t i = 0; i < px_size(im.get()); ++i)
        im->data[i] = uint8_t(lo + im->data[i] % (hi - lo + 1));
    return im;
}

TEST(Exposure, PercentileStretchAndBrightRefusal) {
    for (bool fixed : {false, true}) {
        check_exposure(ranged(17, 13, 8, 30, 170, 1), fixed);
        check_exposure(ranged(40, 40, 8, 0, 255, 2), fixed);
        check_exposure(ranged(9, 31, 24, 60, 120, 3), fixed);
        check_exposure(ranged(8, 8, 8, 205, 255, 4), fixed); // bright: refused, unchanged
        PX mixed = ranged(12, 10, 24, 10, 90, 5);            // bright first channel only
        for (size_t i = 0; i < px_size(mixed.get()); i += 3)
            mixed->data[i] = uint8_t(220 + i % 30);
        check_exposure(std::move(mixed), fixed);
    }
    PX flat = px_make(6, 6, 8, 100);
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

int ref_otsu(const uint8_t *p, size_t n) {
    std::vector<int> h(256);
    for (size_t i = 0; i < n; ++i)
        ++h[p[i]];
    const int total = int(n);
    if (total == h[0] + h[255]) return 120;
    int best = 0, bestT = 120;
    for (int t = 0; t < 255; ++t) {
        int below = 0;
        float m0 = 0, m1 = 0;
        for (int i = 0; i <= t; ++i) {
            below += h[i];
            m0 += float(h[i]) / float(total) * float(i);
        }
        for (int i = t + 1; i < 255; ++i)
            m1 += float(h[i]) / float(total) * float(i);
        const float w0 = float(below) / float(total), w1 = 1.0f - w0;
        if (m0 != 0) m0 /= w0;
        if (m1 != 0) m1 /= w1;
        const int s = int(w0 * w1 * ((m0 - m1) * (m0 - m1)));
        if (s > best) best = s, bestT = t;
    }
    return bestT;
}

TEST(Otsu, ThresholdsOfKnownAndRandomHistograms) {
    auto plane = [](std::initializer_list<std::pair<int, int>> levels) {
        std::vector<uint8_t> p;
        for (auto [v, count] : levels)
            p.insert(p.end(), size_t(count), uint8_t(v));
        return p;
    };
    const auto halves = plane({{50, 8}, {200, 8}}), quarter = plane({{10, 4}, {100, 12}});
    const auto ends = plane({{0, 5}, {255, 11}}), top = plane({{100, 8}, {255, 8}});
    EXPECT_EQ(ProbabilityDensityValue(halves.data(), 4, 4), 50);
    EXPECT_EQ(ProbabilityDensityValue(quarter.data(), 8, 2), 10);
    EXPECT_EQ(ProbabilityDensityValue(ends.data(), 16, 1), 120);
    EXPECT_EQ(ProbabilityDensityValue(top.data(), 4, 4), 100); // level 255 is left out of the upper mean
    EXPECT_EQ(ProbabilityDensityValue(nullptr, 4, 4), 120);
    EXPECT_EQ(ProbabilityDensityValue(halves.data(), 0, 4), 120);
    for (uint32_t seed = 1; seed <= 6; ++seed) {
        PX p = ranged(23, 19, 8, int(seed * 20), 255 - int(seed * 10), seed);
        EXPECT_EQ(ProbabilityDensityValue(p->data, 23, 19), ref_otsu(p->data, 23 * 19)) << seed;
    }
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
            PX src = ranged(w, h, bits, int(seed * 40), 255, seed);
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
    PX words = px_make(5, 5, 16);
    EXPECT_EQ(PXImage_AutoWhiteBalance(words.get(), &mid), 0);
}

TEST(Channels, InversionAndGreenCopy) {
    PX rgb = px_random(5, 3, 24, 9), orig = px_clone(rgb.get());
    ASSERT_EQ(PXImage_BlueEnhancement(rgb.get()), 1);
    for (size_t i = 0; i < px_size(rgb.get()); ++i)
        EXPECT_EQ(rgb->data[i], 255 - orig->data[i]);
    PX gray = px_random(5, 3, 8, 9), g0 = px_clone(gray.get());
    EXPECT_EQ(PXImage_BlueEnhancement(gray.get()), 1);
    EXPECT_EQ(bytes(gray.get()), bytes(g0.get()));
    PX rgba = px_random(4, 3, 32, 10), a0 = px_clone(rgba.get());
    EXPECT_EQ(PXImage_BlueEnhancement(rgba.get()), 0);
    ASSERT_EQ(PXImage_GreenChannel(rgba.get()), 1);
    for (int i = 0; i < 12; ++i) {
        const uint8_t *p = rgba->data + 4 * i, *q = a0->data + 4 * i;
        EXPECT_TRUE(p[0] == q[1] && p[1] == q[1] && p[2] == q[1] && p[3] == q[3]);
    }
    EXPECT_EQ(PXImage_GreenChannel(gray.get()), 0);
}

} // namespace
