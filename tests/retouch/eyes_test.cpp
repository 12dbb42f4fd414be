// Eye enlargement, eye contrast and the dark-circle correction against
// accessor versions, and the automatic eye search on a synthetic face.
#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

// The stretch with the accessors over the whole loop ranges: clamped reads
// and rejected writes do the clipping.
void ref_stretch(Image *im, int32_t cx, int32_t cy, int32_t a, bool ellipse) {
    const int32_t f = int32_t(xxgluSqrtFx(uint32_t(a * a - (a / 2) * (a / 2)))), t = a + f / 2;
    const int64_t f1 = std::clamp<int64_t>(cx - f, 0, im->width - 1),
                  f2 = std::clamp<int64_t>(cx + f, 0, im->width - 1);
    auto move = [&](int32_t x, int32_t y, int dir, int minShift) {
        const int32_t d = int32_t(distance(x - cx, y - cy)),
                      e = int32_t(distance(x - f1, y - cy) + distance(x - f2, y - cy));
        if ((ellipse ? e > 2 * a : d > a) || (!ellipse && minShift == 1 && dir == 1 && d <= 10)) return;
        const float k = ellipse ? (e <= t ? 1.2f : 1.0f + float(2 * a - e) * 0.2f / float(2 * a - t) * 0.5f)
                                : (d <= a / 2 ? 1.2f : 1.0f + float(a - d) * 0.2f / float(a - a / 2));
        const int shift = std::max(int(float(std::abs(y - cy)) / k), minShift);
        SetPixelColor(im, x, y, GetPixelColor(im, x, cy + dir * shift));
    };
    const int32_t x0 = std::max(cx - a, 0), x1 = std::min(cx + a, im->width - 1);
    const int32_t y0 = std::max(cy - (ellipse ? a / 2 : a), 0),
                  y1 = std::min(cy + (ellipse ? (a + 1) / 2 : a), im->height - 1);
    for (int32_t y = y0; y <= cy; ++y)
        for (int32_t x = x0; x <= cx; ++x)
            move(x, y, -1, 0);
    for (int32_t y = y1; y >= cy; --y)
        for (int32_t x = x1; x >= cx; --x)
            move(x, y, 1, 0);
    for (int32_t y = y1; y >= cy + 1; --y)
        for (int32_t x = x0; x <= cx - 1; ++x)
            move(x, y, 1, 1);
    for (int32_t y = y0; y <= cy - 1; ++y)
        for (int32_t x = x1; x >= cx + 1; --x)
            move(x, y, -1, 1);
}

void ref_under_eye(Image *im, int32_t cx, int32_t cy, int32_t strength) {
    const int q = std::clamp(strength, 0, 10) / 10, u = std::max(im->width / 24, 4);
    auto lum = [](uint32_t c) { return (117 * chan(c, 0) + 601 * chan(c, 8) + 306 * chan(c, 16)) >> 10; };
    const int yr = lum(GetPixelColor(im, cx, cy - u - u - u / 2));
    for (int32_t y = cy; y >= cy - 3 * u; --y)
        for (int32_t x = cx - 2 * u; x <= cx + 2 * u; ++x) {
            const int eA = int(distance(x - (cx - u), y - (cy - u)) + distance(x - (cx + u), y - (cy - u)));
            const int eB = int(distance(x - (cx - u), y - (cy + u)) + distance(x - (cx + u), y - (cy + u)));
            const uint32_t c = GetPixelColor(im, x, y);
            if (eA > 4 * u || eB < 4 * u || lum(c) >= yr) continue;
            const int d = yr - lum(c), p = std::min(4 * u - eA, 2 * u), b = std::min(eB - 4 * u, 3 * u);
            int v = std::min((d * b / u) / 3, d * p / (2 * u));
            const int cc = d * (2 * u - std::abs(x - cx)) / (4 * u);
            if (cc < v) v = (cc + v) / 2;
            v = std::min(int(v * (q + 1.0)), d);
            SetPixelColor(im, x, y,
                          (c & 0xFF000000u) | ((chan(c, 0) + v) & 255) | ((chan(c, 8) + v) & 255) << 8 |
                              uint32_t((chan(c, 16) + v) & 255) << 16);
        }
}

const int32_t kCentres[][3] = {{12, 10, 7}, {0, 0, 6},  {24, 19, 9}, {-4, 8, 8},  {12, 30, 11},
                               {30, 5, 12}, {5, 9, 40}, {12, 10, 1}, {12, 10, 0}, {6, 6, -5}};

} // namespace

TEST(EyesEnlarge, EllipseAndCircleMatchAccessorVersion) {
    // Radii above 10 cover the circle's inner lower-left quarter that stays.
    uint32_t seed = 3;
    for (int32_t bc : kBitCounts)
        for (auto [cx, cy, a] : kCentres)
            for (int32_t ellipse : {0, 1}) {
                Owned pic = random_image(25, 20, bc, seed++), ref = clone(pic.get());
                alg_Img_EyesEnlarge(pic.get(), cx, cy, a, ellipse);
                ref_stretch(ref.get(), cx, cy, a, ellipse);
                EXPECT_EQ(diff(pic.get(), ref.get()), "")
                    << bc << " " << cx << "," << cy << " a" << a << " " << ellipse;
            }
    Owned pic = random_image(60, 60, 24, 11), ref = clone(pic.get()), circ = clone(pic.get()), refc = clone(pic.get());
    alg_Img_EyesEnlarge_ellipse(pic.get(), 30, 30, 20), ref_stretch(ref.get(), 30, 30, 20, true);
    alg_Img_EyesEnlarge_circle(circ.get(), 30, 30, 25), ref_stretch(refc.get(), 30, 30, 25, false);
    EXPECT_EQ(diff(pic.get(), ref.get()) + diff(circ.get(), refc.get()), "");
}

TEST(EyesEnlarge, FindsTwoHolesInTheFace) {
    Owned face = filled(100, 100, 24, 0xC89678);
    for (int32_t y = 60; y <= 65; ++y)
        for (int32_t x = 20; x <= 35; ++x) {
            SetPixelColor(face.get(), x, y, 0x202020 + uint32_t(x));
            SetPixelColor(face.get(), x + 40, y, 0x303030 + uint32_t(y));
        }
    Owned expected = clone(face.get());
    alg_Img_EyesEnlarge(expected.get(), 27, 62, 15, 1);
    alg_Img_EyesEnlarge(expected.get(), 67, 62, 15, 1);
    ASSERT_EQ(EyesEnlarge(face.get()), 1);
    EXPECT_EQ(diff(face.get(), expected.get()), "");
    // No skin: empty bands, nothing found, nothing changed.
    Owned blue = filled(40, 30, 32, 0xFF2040C0), before = clone(blue.get());
    EXPECT_EQ(EyesEnlarge(blue.get()) + EyesEnlarge(load_fixture("portrait-128.bmp").get()), 2);
    EXPECT_EQ(diff(blue.get(), before.get()), "");
}

TEST(EyeContrast, StretchesAroundTheBoxMean) {
    // Flat 100: the mean divides by one more row and column than it sums,
    // (20000 / 11) / 21 = 86, so contrast 100 maps 100 to 114; the centre lies
    // at e = 2f = 18 > a and gets weight (20 - 18) / 10: 100 + 14 * 0.2.
    Owned pic = filled(40, 30, 32, 0x55646464), before = clone(pic.get());
    alg_Img_EyesMoreContrast_ellipse(pic.get(), 20, 15, 10, 0);
    EXPECT_EQ(diff(pic.get(), before.get()), "");
    alg_Img_EyesMoreContrast_ellipse(pic.get(), 20, 15, 10, 100);
    EXPECT_EQ(GetPixelColor(pic.get(), 20, 15), 0x55666666u);
    EXPECT_EQ(GetPixelColor(pic.get(), 20, 20), 0x55646464u); // last box row left out
    // Contrast 50 (gain 1.5) around the mean (28200 / 11) / 21 = 122: 141 maps
    // to 19 * 1.5 + 122 + 0.5 = 151 exactly, and only that rounding half
    // lifts the centre row (weight 0.2) from 142.8 to 143.
    Owned half = filled(40, 30, 32, 0x558D8D8D);
    alg_Img_EyesMoreContrast_ellipse(half.get(), 20, 15, 10, 50);
    EXPECT_EQ(GetPixelColor(half.get(), 20, 15), 0x558F8F8Fu);
}

TEST(UnderEye, CrescentCorrection) {
    uint32_t seed = 60;
    for (int32_t bc : kBitCounts)
        for (auto [cx, cy, s] : {std::array{50, 40, 3}, {10, 60, 10}, {95, 5, 12}, {-3, 30, 10}, {48, 50, 9}})
            for (int32_t w : {100, 130}) {
                Owned pic = random_image(w, 70, bc, seed++), ref = clone(pic.get());
                alg_Img_quheiyanquan_ellipse(pic.get(), cx, cy, s);
                ref_under_eye(ref.get(), cx, cy, s);
                EXPECT_EQ(diff(pic.get(), ref.get()), "") << bc << " " << cx << "," << cy << " s" << s;
            }
}
