// Tone curves, automatic levels, exposure and the cross median filter.
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

const int32_t kSizes[][2] = {{1, 1}, {1, 7}, {7, 1}, {2, 3}, {13, 9}, {31, 20}};

std::vector<int32_t> mapping(std::vector<std::pair<int, int32_t>> bins, float low, float high) {
    std::vector<int32_t> t(256, 0);
    for (auto [i, n] : bins)
        t[i] = n;
    MakeMapping(t.data(), low, high);
    return t;
}

Owned ref_auto_levels(const Image *src, int32_t amount) {
    const int32_t w = src->width, h = src->height;
    std::vector<int32_t> hist(256, 0);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            for (int s : {0, 8, 16})
                ++hist[ch(GetPixelColor(src, x, y), s)];
    MakeMapping(hist.data(), 0.0005f, 0.0005f);
    const std::vector<int32_t> &m = hist;
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = GetPixelColor(src, x, y);
            uint32_t o = c & 0xFF000000u;
            for (int s : {0, 8, 16}) {
                const int v = ch(c, s);
                const int n = (m[ch(GetPixelColor(src, x - 1, y), s)] + m[ch(GetPixelColor(src, x + 1, y), s)] +
                               m[ch(GetPixelColor(src, x, y - 1), s)] + m[ch(GetPixelColor(src, x, y + 1), s)] + 2) /
                              4;
                const int sc = 255 - ((255 - n) * (255 - m[v])) / 255;
                o |= uint32_t((amount * sc + (100 - amount) * v) / 100) << s;
            }
            SetPixelColor(out.get(), x, y, o);
        }
    return out;
}

Owned ref_split_levels(const Image *src, bool gamma) {
    const int32_t w = src->width, h = src->height;
    uint8_t g[256];
    for (int i = 0; i < 256; ++i)
        g[i] = static_cast<uint8_t>(i);
    if (gamma) BuildTable(g, 0.8333333f);
    std::vector<int32_t> green(256, 0), dark(256, 0);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            ++green[ch(GetPixelColor(src, x, y), 8)];
    int split = 255, sum = 0;
    for (int i = 255; i > 0; --i)
        if ((sum += green[i]) >= w * h / 2) {
            split = i;
            break;
        }
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = GetPixelColor(src, x, y);
            if (ch(c, 16) <= split) ++dark[ch(c, 0)], ++dark[ch(c, 8)];
        }
    MakeMapping(dark.data(), 0, 0);
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = GetPixelColor(src, x, y);
            SetPixelColor(out.get(), x, y,
                          (c & 0xFF000000u) | g[dark[ch(c, 0)]] | g[dark[ch(c, 8)]] << 8 |
                              uint32_t(g[dark[ch(c, 16)]]) << 16);
        }
    return out;
}

// The cross median written into a copy of `fill` (the filter's untouched pixels).
Owned ref_cross_median(const Image *src, const Image *fill) {
    Owned out = clone(fill);
    for (int32_t y = 8; y < src->height - 8; ++y)
        for (int32_t x = 7; x < src->width - 8; ++x) {
            std::vector<int32_t> v;
            for (int32_t i = -7; i <= 7; ++i) {
                v.push_back(GetPixelIndex(src, x, y + i));
                if (i != 0) v.push_back(GetPixelIndex(src, x + i, y));
            }
            std::sort(v.begin(), v.end());
            SetPixelIndex(out.get(), x, y, v[14]);
        }
    return out;
}

} // namespace

TEST(ToneCurves, GammaTable) {
    uint8_t t[256];
    BuildTable(t, 1.0f);
    for (int i = 0; i < 256; ++i)
        EXPECT_EQ(t[i], i);
    BuildTable(t, 2.0f);
    EXPECT_EQ(t[128], 64);
    EXPECT_EQ(t[0], 0);
    EXPECT_EQ(t[255], 254);
}

TEST(ToneCurves, StretchMapping) {
    EXPECT_EQ(mapping({{77, 5}}, 0.0005f, 0.0005f), std::vector<int32_t>(256, 77));
    EXPECT_EQ(mapping({}, 0.0005f, 0.0005f), std::vector<int32_t>(256, 0));
    const std::vector<int32_t> two = mapping({{10, 3}, {200, 4}}, 0, 0);
    EXPECT_EQ(two[9], 0);
    EXPECT_EQ(two[10], 0);
    EXPECT_EQ(two[105], 127);
    EXPECT_EQ(two[200], 255);
    EXPECT_EQ(two[201], 255);
    // The high cut compares the count itself: one pixel at 250 sets it.
    const std::vector<int32_t> tail = mapping({{100, 1000}, {250, 1}}, 0.0005f, 0.0005f);
    EXPECT_EQ(tail[99], 0);
    EXPECT_EQ(tail[175], 127);
    EXPECT_EQ(tail[250], 255);
}

TEST(AutoGradation, LocalScreenMatchesAccessorVersion) {
    uint32_t seed = 5;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t amount : {0, 37, 100}) {
                Owned src = random_image(w, h, bc, seed++);
                Slot dst;
                ASSERT_EQ(ImageAutoGradationProcess(src.get(), &dst, amount), 1);
                EXPECT_EQ(diff(dst.get(), ref_auto_levels(src.get(), amount).get()), "")
                    << bc << " " << w << "x" << h << " " << amount;
            }
    Owned portrait = load_fixture("portrait-128.bmp");
    Slot zero, over;
    ImageAutoGradationProcess(portrait.get(), &zero, -20);
    EXPECT_EQ(diff(zero.get(), portrait.get()), "");
    ImageAutoGradationProcess(portrait.get(), &over, 250);
    EXPECT_EQ(diff(over.get(), ref_auto_levels(portrait.get(), 100).get()), "");
}

TEST(AutoGradation, DarkHalfStretchMatchesAccessorVersion) {
    uint32_t seed = 40;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (int32_t gamma : {0, 1}) {
                Owned src = random_image(w, h, bc, seed++);
                Slot dst;
                ImageAutoGradationProcess1(src.get(), &dst, 0, gamma);
                EXPECT_EQ(diff(dst.get(), ref_split_levels(src.get(), gamma != 0).get()), "")
                    << bc << " " << w << "x" << h << " " << gamma;
            }
}

TEST(Exposure, LightnessShift) {
    Owned portrait = load_fixture("portrait-128.bmp");
    Image *h = nullptr, *s = nullptr, *l = nullptr;
    ASSERT_EQ(Split(portrait.get(), &h, &s, &l, nullptr, 1), 1);
    Owned roundTrip(Combine(h, s, l, nullptr, 1));
    free_Image(&h, 0), free_Image(&s, 0), free_Image(&l, 0);
    Slot same;
    ASSERT_EQ(ImageExposure(portrait.get(), &same, 0), 1);
    EXPECT_EQ(diff(same.get(), roundTrip.get()), "");
    Slot white;
    ASSERT_EQ(ImageExposure(portrait.get(), &white, 300), 1);
    EXPECT_EQ(GetPixelColor(white.get(), 64, 64) & 0xFFFFFF, 0xFFFFFFu);
    // A 16-bit source gets a 16-bit result through a converting copy.
    Owned deep = random_image(9, 4, 16, 2);
    Slot converted;
    ASSERT_EQ(ImageExposure(deep.get(), &converted, 10), 1);
    EXPECT_EQ(converted->bitCount, 16u);
    EXPECT_EQ(ImageExposure(nullptr, &converted, 0), 0);
    EXPECT_EQ(ImageExposure(deep.get(), nullptr, 0), 0);
}

TEST(CrossMedian, MatchesSortedCrossInEveryMode) {
    uint32_t seed = 300;
    for (auto [w, h] : {std::pair{15, 30}, {16, 16}, {16, 17}, {17, 16}, {23, 31}, {40, 19}}) {
        Owned src = random_image(w, h, 8, seed++);
        Owned inPlace = clone(src.get());
        ASSERT_EQ(MyOneKeyFliter(inPlace.get(), nullptr), 1);
        EXPECT_EQ(diff(inPlace.get(), ref_cross_median(src.get(), src.get()).get()), "") << w << "x" << h;
        Slot empty;
        ASSERT_EQ(MyOneKeyFliter(src.get(), &empty), 1);
        EXPECT_EQ(diff(empty.get(), ref_cross_median(src.get(), make(w, h, 8).get()).get()), "");
        Slot held;
        held.image = malloc_Image(w, h, 8);
        Image *before = held.get();
        ASSERT_EQ(MyOneKeyFliter(src.get(), &held), 1);
        EXPECT_EQ(held.get(), before);
        EXPECT_EQ(diff(held.get(), empty.get()), "");
    }
    Owned deep = random_image(20, 20, 24, 1);
    EXPECT_EQ(MyOneKeyFliter(deep.get(), nullptr), 0);
}

TEST(ThresholdBlur, NearBlackWindowsAndCurves) {
    uint32_t seed = 500;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            for (auto [size, amount] : {std::pair{1, 50}, {3, 100}, {0, -5}, {14, 130}}) {
                Owned src = random_image(w, h, bc, seed++);
                const int32_t sz = std::clamp(size, 1, 10), am = std::clamp(amount, 0, 100);
                uint8_t curve[3][256];
                const int32_t a[3] = {am * 75 / 100, am * 61 / 100, am * 73 / 100};
                for (int c = 0; c < 3; ++c)
                    for (int i = 0; i < 256; ++i)
                        curve[c][i] = uint8_t((i * (100 - a[c]) + a[c] * ZANTOMOPI[ZANTOFILTER[i]] + 63) / 100);
                Owned expected = make(w, h, bc);
                for (int32_t y = 0; y < h; ++y)
                    for (int32_t x = 0; x < w; ++x) {
                        bool dark[3] = {};
                        uint32_t last = 0;
                        for (int32_t k = -sz; k <= sz; ++k) {
                            last = GetPixelColor(src.get(), x + k, y);
                            for (int c = 0; c < 3; ++c)
                                dark[c] = dark[c] || ch(last, 8 * c) <= 10;
                        }
                        uint32_t o = last & 0xFF000000u;
                        for (int c = 0; c < 3; ++c)
                            o |= uint32_t(curve[c][dark[c] ? 0 : ch(last, 8 * c)]) << 8 * c;
                        SetPixelColor(expected.get(), x, y, o);
                    }
                Slot dst;
                thresholdBlur(0, 0, size, amount, src.get(), &dst);
                EXPECT_EQ(diff(dst.get(), expected.get()), "") << bc << " " << w << "x" << h << " " << size;
            }
}
