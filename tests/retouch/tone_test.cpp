// Tone curves, automatic levels, exposure and the cross median filter.
#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

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
                ++hist[chan(GetPixelColor(src, x, y), s)];
    MakeMapping(hist.data(), 0.0005f, 0.0005f);
    const std::vector<int32_t> &m = hist;
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = GetPixelColor(src, x, y);
            uint32_t o = c & 0xFF000000u;
            for (int s : {0, 8, 16}) {
                const int v = chan(c, s);
                const int n =
                    (m[chan(GetPixelColor(src, x - 1, y), s)] + m[chan(GetPixelColor(src, x + 1, y), s)] +
                     m[chan(GetPixelColor(src, x, y - 1), s)] + m[chan(GetPixelColor(src, x, y + 1), s)] + 2) /
                    4;
                const int sc = 255 - ((255 - n) * (255 - m[v])) / 255;
                o |= uint32_t((amount * sc + (100 - amount) * v) / 100) << s;
            }
            SetPixelColor(out.get(), x, y, o);
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

TEST(ToneCurves, GammaTableAndStretchMapping) {
    uint8_t t[256];
    BuildTable(t, 2.0f);
    EXPECT_EQ(t[128] + t[255] * 1000, 64 + 254 * 1000);
    BuildTable(t, std::nanf(""));
    EXPECT_EQ(std::vector<uint8_t>(t, t + 256), std::vector<uint8_t>(256, 0));
    EXPECT_EQ(mapping({{77, 5}}, 0.0005f, 0.0005f), std::vector<int32_t>(256, 77));
    EXPECT_EQ(mapping({}, 0.0005f, 0.0005f), std::vector<int32_t>(256, 0));
    const std::vector<int32_t> two = mapping({{10, 3}, {200, 4}}, 0, 0);
    EXPECT_EQ(std::vector<int32_t>({two[9], two[10], two[105], two[200], two[201]}),
              std::vector<int32_t>({0, 0, 127, 255, 255}));
    // The high cut compares the count itself: one pixel at 250 sets it.
    const std::vector<int32_t> tail = mapping({{100, 1000}, {250, 1}}, 0.0005f, 0.0005f);
    EXPECT_EQ(std::vector<int32_t>({tail[99], tail[175], tail[250]}), std::vector<int32_t>({0, 127, 255}));
}

TEST(AutoGradation, LocalScreenMatchesAccessorVersion) {
    for (int32_t amount : {-20, 37, 250}) // amounts clamp to 0..100
        expect_like_reference(
            [amount](Image *s, Image **d) { return uint32_t(ImageAutoGradationProcess(s, d, amount)); },
            [amount](const Image *s) { return ref_auto_levels(s, std::clamp(amount, 0, 100)); },
            uint32_t(amount + 100));
}

TEST(AutoGradation, DarkHalfStretch) {
    // Four pixels; the split is green 100 (two of four at or above it). The
    // dark half (red <= 100) spans blue and green 20..60, stretched to 0..255
    // for all three channels, then the 5/6 gamma.
    Owned src = make(2, 2, 24);
    const uint32_t colours[] = {0x321414, 0x643C28, 0xC86464, 0xFAFAFA};
    for (int i = 0; i < 4; ++i)
        SetPixelColor(src.get(), i % 2, i / 2, colours[i]);
    uint8_t gamma[256];
    BuildTable(gamma, 0.8333333f);
    Slot plain, curved;
    ImageAutoGradationProcess1(src.get(), &plain, 0, 0);
    ImageAutoGradationProcess1(src.get(), &curved, 0, 1);
    EXPECT_EQ(GetPixelColor(plain.get(), 0, 0), 0xFFBF0000u); // red 50 -> 191, 20 -> 0
    EXPECT_EQ(GetPixelColor(plain.get(), 1, 0), 0xFFFFFF7Fu);
    EXPECT_EQ(GetPixelColor(curved.get(), 1, 0), 0xFF000000u | gamma[255] << 16 | gamma[255] << 8 | gamma[127]);
}

TEST(Exposure, LightnessShiftThroughAConvertingCopy) {
    Owned deep = random_image(9, 4, 16, 2);
    Slot converted;
    ASSERT_EQ(ImageExposure(deep.get(), &converted, 300), 1);
    EXPECT_EQ(GetPixelColor(converted.get(), 3, 3), 0x00F8FCF8u); // white as a 16-bit word
    ASSERT_EQ(ImageExposure(deep.get(), &converted, -300), 1);
    EXPECT_EQ(GetPixelColor(converted.get(), 3, 3), 0u);
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
    }
}

TEST(ThresholdBlur, NearBlackTapsBlackenTheirNeighbours) {
    // Amount 0 keeps identity curves: a green of at most 10 turns the green of
    // every pixel within `size` columns of it to 0, 11 does not; blue and red
    // stay. 16 bits hold green in 6 bits, so only 5 is tried there.
    for (int32_t bc : {16, 24, 32})
        for (uint32_t g : {5u, 10u, 11u}) {
            if (bc == 16 && g != 5) continue;
            Owned src = filled(20, 3, bc, 0xFF808080);
            SetPixelColor(src.get(), 9, 1, 0xFF800080 | g << 8);
            Slot dst;
            thresholdBlur(0, 0, 3, 0, src.get(), &dst);
            for (int32_t x = 0; x < 20; ++x) {
                const uint32_t c = GetPixelColor(dst.get(), x, 1), o = GetPixelColor(src.get(), x == 9 ? 8 : x, 1);
                EXPECT_EQ(chan(c, 8) == 0, g <= 10 && x >= 6 && x <= 12) << bc << " " << g << " " << x;
                EXPECT_EQ(chan(c, 16), chan(o, 16));
            }
        }
}
