// Skin mask, skin smoothing and the rank filters, against accessor versions
// on portrait-like pictures of every format and on the bundled portrait (the
// mask in the picture's own format, SmileDetect, is pinned by the golden
// hashes).
#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

const int32_t kSizes[][2] = {{1, 1}, {1, 9}, {30, 1}, {11, 11}, {12, 12}, {13, 17}, {41, 33}, {64, 30}};

int tone(int v) { return (52 * v + 75 * ZANTOFILTER[v] + 63) / 127; }

} // namespace

TEST(SkinMask, MaskAndSpotBrighteningMatchAccessorVersions) {
    // Besides the noise pictures: a field of skin with one hole (the erosion
    // reads the mask it rewrites), skin runs of 19 and 20 and one of 5 that
    // reaches the last column, and the portrait.
    std::vector<Owned> pics;
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes)
            pics.push_back(skin_picture(w, h, bc, seed++));
    pics.push_back(filled(50, 50, 24, 0x907050)), pics.push_back(filled(46, 1, 32, 0x906050));
    SetPixelColor(pics.end()[-2].get(), 20, 20, 0);
    SetPixelColor(pics.back().get(), 19, 0, 0), SetPixelColor(pics.back().get(), 40, 0, 0);
    pics.push_back(load_fixture("portrait-128.bmp"));
    for (const Owned &src : pics) {
        Slot m, dst;
        ASSERT_EQ(CreateFaceMaskImg(src.get(), &m), 1);
        EXPECT_EQ(diff(m.get(), ref_mask(src.get()).get()), "")
            << src->width << "x" << src->height << "@" << src->bitCount;
        ASSERT_EQ(alg_Img_smooth_1(src.get(), &dst), 1);
        EXPECT_EQ(diff(dst.get(), ref_smooth_1(src.get()).get()), "") << src->width << "x" << src->height;
    }
    const Image *portrait = pics.back().get();
    // Smoothed in place: each pixel is read before it is written.
    Owned inPlace = clone(portrait);
    Image *same = inPlace.get();
    ASSERT_EQ(alg_Img_smooth_1(same, &same), 1);
    ASSERT_EQ(same, inPlace.get());
    EXPECT_EQ(diff(same, ref_smooth_1(portrait).get()), "");
    // Skin tone: LightUP once without lighten, twice with, then the 52:75 blend.
    for (int32_t lighten : {0, 1}) {
        Owned want = mapped(ref_smooth_1(portrait).get(),
                            [&](int v) { return tone(lighten ? ZANTOMOPI[ZANTOMOPI[v]] : ZANTOMOPI[v]); });
        Slot skin;
        EXPECT_EQ(alg_Img_Skin(portrait, &skin, lighten), 1);
        EXPECT_EQ(diff(skin.get(), want.get()), "") << lighten;
    }
}

TEST(RankFilters, BestColorAndMoreLightMatchSortedWindows) {
    uint32_t seed = 90;
    for (int32_t size : {-3, 0, 1, 2, 3, 4, 5, 8, 25})
        for (auto [w, h] : {std::pair{1, 1}, {7, 3}, {3, 7}, {23, 19}}) {
            Owned im = random_image(w, h, 8, seed++), want = clone(im.get());
            for (int32_t y = 0; y < h; ++y)
                for (int32_t x = 0; x < w; ++x)
                    SetPixelIndex(want.get(), x, y, window(im.get(), x, y, size).list[2]);
            ASSERT_EQ(Best_Color(im.get(), size), 1);
            EXPECT_EQ(diff(im.get(), want.get()), "") << size << " " << w << "x" << h;
        }
    for (int32_t bc : kBitCounts)
        for (int32_t size : {-2, -1, 0, 1, 2, 3, 6}) {
            Owned src = random_image(17, 13, bc, seed++), want = make(17, 13, bc);
            for (int32_t y = 0; y < 13; ++y)
                for (int32_t x = 0; x < 17; ++x) {
                    const uint32_t col = GetPixelColor(src.get(), x, y);
                    const int32_t c = GetPixelIndex(src.get(), x, y);
                    const Window win = window(src.get(), x, y, size);
                    const int d = (win.list[0] - c) & 255;
                    const bool lifted = c != 0 && getpos(win.list, size * size, c) >= size * size / 2 && d > 10;
                    SetPixelColor(want.get(), x, y, lifted ? lift(col, d, 0.8, 0.8, 0.8) : col);
                }
            Slot dst;
            MoreLight(src.get(), size, &dst);
            EXPECT_EQ(diff(dst.get(), want.get()), "") << bc << " " << size;
        }
}
