// Exposure, Otsu threshold and white balance; the curve-table colour filters
// against per-sample maps written straight from their rules.
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

// Otsu's split with level 255 left out of the upper mean; 120 when there is nothing to split.
TEST(Otsu, TopLevelAndDegenerateInputs) {
    const uint8_t top[16] = {10, 10, 10, 10, 240, 240, 240, 240, 255, 255, 255, 255, 255, 255, 255, 255},
                  ends[16] = {0, 0, 0, 0, 0, 255, 255, 255, 255, 255, 255, 255, 255, 255, 255, 255};
    EXPECT_EQ(ProbabilityDensityValue(top, 4, 4), 240);
    EXPECT_EQ(ProbabilityDensityValue(ends, 16, 1), 120);
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
        for (int seed = 1; seed <= 4; ++seed) {
            const int w = 9, h = 7;
            PX src = px_random(w, h, bits, uint32_t(seed));
            for (size_t i = 0; i < px_size(src.get()); ++i) // lift some references into the gate, then all above
                src->data[i] = uint8_t(std::max<int>(src->data[i], seed < 4 ? seed * 60 : 253));
            const PXPoint pts[] = {{4, 3}, {0, 0}, {w - 1, h - 1}, {w + 5, -3}, {-7, h + 2}, {w - 2, 0}};
            for (const PXPoint &pt : pts) {
                PX img = px_clone(src.get());
                ASSERT_EQ(PXImage_AutoWhiteBalance(img.get(), &pt), 1);
                EXPECT_EQ(bytes(img.get()), bytes(ref_balance(src.get(), pt.x, pt.y).get()))
                    << bits << " bits at " << pt.x << "," << pt.y;
            }
        }
}

// The level map an 8-bit filter applies, read off a picture of every level.
std::vector<int> map_of(const std::function<int32_t(Image *)> &fn) {
    Owned ramp = make(16, 16, 8);
    for (int v = 0; v < 256; ++v)
        ramp->bits[v / 16 * 16 + v % 16] = uint8_t(v);
    EXPECT_EQ(fn(ramp.get()), 1);
    return std::vector<int>(ramp->bits, ramp->bits + 256);
}

// Sum of (i + 1) * t[i] over 256 entries: a moved or changed entry shows.
template <class T> int64_t weighted_sum(const T *t) {
    int64_t sum = 0;
    for (int i = 0; i < 256; ++i)
        sum += int64_t(i + 1) * t[i];
    return sum;
}

TEST(ColorFilter, LevelMaps) {
    // colour (R in bits 0-7) -> shift; luminance 127 and 128 change nothing
    const std::pair<uint32_t, int> shifts[] = {{0x000000, -44}, {0xFFFFFF, 47}, {0x0000FF, -17}, {0x00FF00, 8},
                                               {0xFF0000, -33}, {0x7F7F7F, 0},  {0x808080, 0}};
    for (auto [colour, delta] : shifts) {
        std::vector<int> want(256);
        for (int v = 0; v < 256; ++v)
            want[v] = std::min(255, std::max(0, v + delta));
        EXPECT_EQ(map_of([&](Image *i) { return ColorFilter(i, colour, nullptr); }), want) << colour;
    }
    // ColorFilter1 bows a circle through both ends by the strength and
    // inverts it when darkening: its maps as weighted sums.
    const std::pair<int, int64_t> bowed[] = {{0, 3625129},   {1, 3625129},   {60, 3821173}, {127, 3968242},
                                             {129, 6914945}, {200, 7016953}, {255, 7132103}};
    for (auto [level, want] : bowed) {
        const int d = std::abs(level - 128), e = 127 - d;
        const uint8_t *curve = level > 128 ? ZANTOFILTER : ZANTOFILTERBK;
        std::vector<int> blend(256);
        for (int i = 0; i < 256; ++i)
            blend[i] = ((e * i + d * curve[i] + 63) / 127) & 255;
        EXPECT_EQ(weighted_sum(map_of([&](Image *i) { return ColorFilter1(i, level); }).data()), want) << level;
        EXPECT_EQ(map_of([&](Image *i) { return ColorFilter_zanto(i, level); }), blend) << level;
    }
}

TEST(ColorFilter, TintMasks) {
    Owned mask = random_image(7, 11, 8, 99), gray = random_image(13, 9, 8, 1), rgb = random_image(13, 9, 24, 2);
    Owned gray0 = clone(gray.get()), rgb0 = clone(rgb.get());
    mask->bits[0] = 0;
    ASSERT_EQ(ColorFilter(gray.get(), 0, mask.get()) + ColorFilter24(rgb.get(), 0xFF0080, mask.get()), 2);
    for (int y = 0; y < 9; ++y)
        for (int x = 0; x < 13; ++x) {
            const bool sel = x < 7 && GetPixelIndex(mask.get(), x, y) != 0;
            const int v = GetPixelIndex(gray0.get(), x, y);
            EXPECT_EQ(GetPixelIndex(gray.get(), x, y), sel ? std::max(0, v - 44) : v);
            const uint32_t c = GetPixelColor(rgb0.get(), x, y), target[3] = {0xFF, 0x00, 0x80};
            for (int k = 0; k < 3; ++k) { // pixel bytes blue, green, red against colour bits 16-23, 8-15, 0-7
                const uint32_t b = (c >> 8 * k) & 255;
                EXPECT_EQ((GetPixelColor(rgb.get(), x, y) >> 8 * k) & 255, sel ? (210 * b + 45 * target[k]) / 255 : b);
            }
        }
}

} // namespace
