// Skin mask, skin smoothing and the rank filters, against accessor versions
// on portrait-like pictures of every format and on the bundled portrait.
#include <gtest/gtest.h>

#include <vector>

#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

const int32_t kSizes[][2] = {{1, 1}, {1, 9}, {30, 1}, {11, 11}, {12, 12}, {13, 17}, {41, 33}, {64, 30}};

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
    // Skin runs of 19 and 20 and a run of 5 that reaches the last column.
    Owned a = filled(46, 1, 24, 0x906050);
    SetPixelColor(a.get(), 19, 0, 0), SetPixelColor(a.get(), 40, 0, 0);
    Slot m;
    ASSERT_EQ(CreateFaceMaskImg(a.get(), &m), 1);
    for (int32_t x = 0; x < 46; ++x)
        EXPECT_EQ(GetPixelIndex(m.get(), x, 0), (x >= 20 && x < 40) || x == 45 ? 0x60u : 0u) << x;
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
        map_pixels(expected.get(), [&](int v, int) { return lighten ? ZANTOMOPI[ZANTOMOPI[v]] : ZANTOMOPI[v]; });
        map_pixels(expected.get(), [](int v, int) { return (52 * v + 75 * ZANTOFILTER[v] + 63) / 127; });
        Slot skin;
        EXPECT_EQ(alg_Img_Skin(portrait.get(), &skin, lighten), 1);
        EXPECT_EQ(diff(skin.get(), expected.get()), "") << lighten;
    }
    // LightUP on the 16-bit words.
    Owned deep = random_image(9, 5, 16, 70), expected = clone(deep.get());
    map_pixels(expected.get(), [](int v, int) { return ZANTOMOPI[v]; });
    ASSERT_EQ(LightUP(deep.get()), 1);
    EXPECT_EQ(diff(deep.get(), expected.get()), "");
    Slot skin16, steps;
    alg_Img_Skin(deep.get(), &skin16, 1);
    alg_Img_smooth(deep.get(), &steps);
    LightUP(steps.get());
    map_pixels(steps.get(), [](int v, int) { return (52 * v + 75 * ZANTOFILTER[v] + 63) / 127; });
    EXPECT_EQ(diff(skin16.get(), steps.get()), "");
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
        for (int32_t size : {-2, -1, 0, 1, 2, 3, 6}) {
            Owned src = random_image(17, 13, bc, seed++), expected = make(17, 13, bc);
            for (int32_t y = 0; y < 13; ++y)
                for (int32_t x = 0; x < 17; ++x) {
                    const uint32_t col = GetPixelColor(src.get(), x, y);
                    const int32_t c = GetPixelIndex(src.get(), x, y);
                    const Window win = window(src.get(), x, y, size);
                    const int d = (win.list[0] - c) & 255;
                    const bool lifted = c != 0 && getpos(win.list, size * size, c) >= size * size / 2 && d > 10;
                    SetPixelColor(expected.get(), x, y, lifted ? lift(col, d, 0.8, 0.8, 0.8) : col);
                }
            Slot dst;
            MoreLight(src.get(), size, &dst);
            EXPECT_EQ(diff(dst.get(), expected.get()), "") << bc << " " << size;
        }
    Slot dst;
    MoreLight(random_image(4, 4, 8, 1).get(), 256, &dst);
    EXPECT_EQ(dst.get(), nullptr);
}
