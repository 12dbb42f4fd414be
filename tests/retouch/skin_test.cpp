// Skin mask, skin smoothing and the rank filters, against accessor versions
// on portrait-like pictures of every format and on the bundled portrait.
#include <gtest/gtest.h>

#include <vector>

#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

const int32_t kSizes[][2] = {{1, 1}, {1, 9}, {30, 1}, {11, 11}, {12, 12}, {13, 17}, {41, 33}, {64, 30}};

Owned row_of(const std::initializer_list<std::pair<int32_t, uint32_t>> &runs) {
    int32_t w = 0;
    for (auto [n, c] : runs)
        w += n;
    Owned im = make(w, 1, 24);
    int32_t x = 0;
    for (auto [n, c] : runs)
        for (int32_t i = 0; i < n; ++i)
            SetPixelColor(im.get(), x++, 0, c);
    return im;
}

uint32_t mask_at(const Image *src, int32_t x, int32_t y) {
    Slot mask;
    EXPECT_EQ(CreateFaceMaskImg(src, &mask), 1);
    return GetPixelIndex(mask.get(), x, y);
}

} // namespace

TEST(SkinMask, ColourRuleThresholds) {
    EXPECT_EQ(mask_at(filled(40, 1, 24, 0x323232).get(), 3, 0), 50u);   // gray 50 is skin
    EXPECT_EQ(mask_at(filled(40, 1, 24, 0x313131).get(), 3, 0), 0u);    // gray 49 is not
    EXPECT_EQ(mask_at(filled(40, 1, 24, 0x800000).get(), 3, 0), 0u);    // green 0 reads as not skin
    EXPECT_EQ(mask_at(filled(40, 1, 24, 0x8081A0).get(), 3, 0), 0u);    // green above red
    EXPECT_EQ(mask_at(filled(40, 1, 24, 0x807060).get(), 39, 0), 112u); // last column kept
}

TEST(SkinMask, ShortRunsRemovedLongOnesKept) {
    const uint32_t skin = 0x906050, none = 0x000000;
    Owned a = row_of({{19, skin}, {1, none}, {20, skin}, {1, none}, {5, skin}});
    Slot m;
    ASSERT_EQ(CreateFaceMaskImg(a.get(), &m), 1);
    for (int32_t x = 0; x < 19; ++x)
        EXPECT_EQ(GetPixelIndex(m.get(), x, 0), 0u) << x;
    for (int32_t x = 20; x < 40; ++x)
        EXPECT_EQ(GetPixelIndex(m.get(), x, 0), 0x60u) << x;
    // The run touching the last column is cut at it: 4 counted, cleared, last kept.
    for (int32_t x = 41; x < 45; ++x)
        EXPECT_EQ(GetPixelIndex(m.get(), x, 0), 0u) << x;
    EXPECT_EQ(GetPixelIndex(m.get(), 45, 0), 0x60u);
}

TEST(SkinMask, ErosionReadsTheMaskItRewrites) {
    // One non-skin pixel in a field of skin: windows visited before it still
    // see its 0, windows after it see the 1 it became.
    Owned src = filled(50, 50, 24, 0x907050);
    SetPixelColor(src.get(), 20, 20, 0);
    Slot m;
    ASSERT_EQ(CreateFaceMaskImg(src.get(), &m), 1);
    EXPECT_EQ(GetPixelIndex(m.get(), 15, 15), 0u);
    EXPECT_EQ(GetPixelIndex(m.get(), 25, 19), 0u);
    EXPECT_EQ(GetPixelIndex(m.get(), 15, 20), 0u);
    EXPECT_EQ(GetPixelIndex(m.get(), 20, 20), 0u);
    EXPECT_EQ(GetPixelIndex(m.get(), 21, 20), 0x70u);
    EXPECT_EQ(GetPixelIndex(m.get(), 20, 21), 0x70u);
    EXPECT_EQ(GetPixelIndex(m.get(), 14, 19), 0x70u);
}

TEST(SkinMask, MatchesAccessorVersion) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = skin_picture(w, h, bc, seed++);
            Slot m;
            ASSERT_EQ(CreateFaceMaskImg(src.get(), &m), 1);
            EXPECT_EQ(diff(m.get(), ref_mask(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
    Owned portrait = load_fixture("portrait-128.bmp");
    ASSERT_TRUE(portrait);
    Slot m, shown;
    ASSERT_EQ(CreateFaceMaskImg(portrait.get(), &m), 1);
    Owned ref = ref_mask(portrait.get());
    EXPECT_EQ(diff(m.get(), ref.get()), "");
    // SmileDetect hands the mask out in the source's format.
    ASSERT_EQ(SmileDetect(portrait.get(), &shown, 0), 1);
    Owned expected = make(128, 128, 24);
    PX_Img_Copy(expected.get(), ref.get());
    EXPECT_EQ(diff(shown.get(), expected.get()), "");
    Image *slot = nullptr;
    EXPECT_EQ(CreateFaceMaskImg(nullptr, &slot), 0);
    EXPECT_EQ(CreateFaceMaskImg(portrait.get(), nullptr), 0);
}

TEST(SkinSmooth, SpotBrighteningMatchesAccessorVersion) {
    uint32_t seed = 50;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = skin_picture(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(alg_Img_smooth_1(src.get(), &dst), 1);
            EXPECT_EQ(diff(dst.get(), ref_smooth_1(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
    Owned portrait = load_fixture("portrait-128.bmp");
    Owned ref = ref_smooth_1(portrait.get());
    Slot dst;
    ASSERT_EQ(alg_Img_smooth_1(portrait.get(), &dst), 1);
    EXPECT_EQ(diff(dst.get(), ref.get()), "");
    // Skin tone: LightUP once without lighten, twice with, then the 52:75 blend.
    for (int32_t lighten : {0, 1}) {
        Owned expected = clone(ref.get());
        for (int i = 0; i <= lighten; ++i)
            LightUP(expected.get());
        for (int32_t y = 0; y < 128; ++y)
            for (int32_t x = 0; x < 128; ++x) {
                const uint32_t c = GetPixelColor(expected.get(), x, y);
                uint32_t o = c & 0xFF000000u;
                for (int s : {0, 8, 16})
                    o |= uint32_t((52 * ch(c, s) + 75 * ZANTOFILTER[ch(c, s)] + 63) / 127) << s;
                SetPixelColor(expected.get(), x, y, o);
            }
        Slot skin;
        EXPECT_EQ(alg_Img_Skin(portrait.get(), &skin, lighten), 1);
        EXPECT_EQ(diff(skin.get(), expected.get()), "") << lighten;
    }
}

TEST(SkinSmooth, LightUpOnEveryFormat) {
    uint32_t seed = 70;
    for (int32_t bc : kBitCounts) {
        Owned im = random_image(9, 5, bc, seed++);
        Owned expected = clone(im.get());
        for (int32_t y = 0; y < 5; ++y)
            for (int32_t x = 0; x < 9; ++x) {
                const uint32_t c = GetPixelColor(im.get(), x, y);
                SetPixelColor(expected.get(), x, y,
                              (c & 0xFF000000u) | ZANTOMOPI[ch(c, 0)] | ZANTOMOPI[ch(c, 8)] << 8 |
                                  uint32_t(ZANTOMOPI[ch(c, 16)]) << 16);
            }
        ASSERT_EQ(LightUP(im.get()), 1);
        EXPECT_EQ(diff(im.get(), expected.get()), "") << bc;
    }
    EXPECT_EQ(ZANTOMOPI[120], 145);
    EXPECT_EQ(LightUP(nullptr), 0);
}

TEST(RankFilters, SortAndPosition) {
    int32_t v[] = {3, -7, 9, 3, 0, 9};
    Sort_largelow(v, 6);
    EXPECT_EQ(std::vector<int32_t>(v, v + 6), (std::vector<int32_t>{9, 9, 3, 3, 0, -7}));
    EXPECT_EQ(getpos(v, 6, 3), 2);
    EXPECT_EQ(getpos(v, 6, 2), 4);
    EXPECT_EQ(getpos(v, 6, -8), 6);
}

TEST(RankFilters, BestColorIsTheThirdLargest) {
    uint32_t seed = 90;
    for (int32_t size : {-3, 0, 1, 2, 3, 4, 5, 8, 25})
        for (auto [w, h] : {std::pair{1, 1}, {7, 3}, {3, 7}, {23, 19}}) {
            Owned im = random_image(w, h, 8, seed++);
            Owned expected = clone(im.get());
            for (int32_t y = 0; y < h; ++y)
                for (int32_t x = 0; x < w; ++x)
                    SetPixelIndex(expected.get(), x, y, window(im.get(), x, y, size).list[2]);
            ASSERT_EQ(Best_Color(im.get(), size), 1);
            EXPECT_EQ(diff(im.get(), expected.get()), "") << size << " " << w << "x" << h;
        }
    Owned im = random_image(6, 6, 8, 3), before = clone(im.get());
    EXPECT_EQ(Best_Color(im.get(), 26), 0);
    EXPECT_EQ(diff(im.get(), before.get()), "");
    Owned deep = random_image(6, 6, 24, 3);
    EXPECT_EQ(Best_Color(deep.get(), 3), 0);
}

TEST(RankFilters, MoreLightLiftsDarkSpecks) {
    uint32_t seed = 120;
    for (int32_t bc : kBitCounts)
        for (int32_t size : {-2, -1, 0, 1, 2, 3, 6})
            for (auto [w, h] : {std::pair{1, 1}, {5, 9}, {17, 13}}) {
                Owned src = random_image(w, h, bc, seed++);
                Owned expected = make(w, h, bc);
                const int32_t n = size * size;
                for (int32_t y = 0; y < h; ++y)
                    for (int32_t x = 0; x < w; ++x) {
                        const uint32_t col = GetPixelColor(src.get(), x, y);
                        const int32_t c = GetPixelIndex(src.get(), x, y);
                        uint32_t out = col;
                        if (c != 0) {
                            const Window win = window(src.get(), x, y, size);
                            const int d = (win.list[0] - c) & 255;
                            if (getpos(win.list, n, c) >= n / 2 && d > 10) out = lift(col, d, 0.8, 0.8, 0.8);
                        }
                        SetPixelColor(expected.get(), x, y, out);
                    }
                Slot dst;
                MoreLight(src.get(), size, &dst);
                EXPECT_EQ(diff(dst.get(), expected.get()), "") << bc << " " << size << " " << w << "x" << h;
            }
    Owned src = random_image(4, 4, 8, 1);
    Slot dst;
    MoreLight(src.get(), 256, &dst);
    EXPECT_EQ(dst.get(), nullptr);
    MoreLight(src.get(), INT32_MAX, &dst);
    EXPECT_EQ(dst.get(), nullptr);
}
