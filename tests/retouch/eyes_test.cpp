// Eye enlargement, eye contrast and the dark-circle correction against
// accessor versions, and the automatic eye search on a synthetic face.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>

#include "retouch/reference.hpp"

using namespace pxtest;
using namespace rtest;

namespace {

struct Ellipse {
    int64_t f1, f2;
    uint32_t e(int32_t x, int32_t y, int32_t cy) const { return distance(x - f1, y - cy) + distance(x - f2, y - cy); }
};

Ellipse foci(const Image *im, int32_t cx, int32_t a) {
    const int64_t f = xxgluSqrtFx(uint32_t(a * a - (a / 2) * (a / 2)));
    return {std::clamp<int64_t>(cx - f, 0, im->width - 1), std::clamp<int64_t>(cx + f, 0, im->width - 1)};
}

// The four quadrant passes over every row and column of the loops, with
// clamped reads and rejected writes doing the clipping.
template <class K>
void ref_passes(Image *im, int32_t cx, int32_t cy, int32_t x0, int32_t x1, int32_t y0, int32_t y1, K factor,
                bool circle) {
    auto move = [&](int32_t x, int32_t y, int dir, int minShift) {
        const float k = factor(x, y);
        if (k == 0) return;
        const int shift = std::max(int(float(std::abs(y - cy)) / k), minShift);
        SetPixelColor(im, x, y, GetPixelColor(im, x, cy + dir * shift));
    };
    for (int32_t y = y0; y <= cy; ++y)
        for (int32_t x = x0; x <= cx; ++x)
            move(x, y, -1, 0);
    for (int32_t y = y1; y >= cy; --y)
        for (int32_t x = x1; x >= cx; --x)
            move(x, y, 1, 0);
    for (int32_t y = y1; y >= cy + 1; --y)
        for (int32_t x = x0; x <= cx - 1; ++x)
            if (!circle || distance(x - cx, y - cy) > 10) move(x, y, 1, 1);
    for (int32_t y = y0; y <= cy - 1; ++y)
        for (int32_t x = x1; x >= cx + 1; --x)
            move(x, y, -1, 1);
}

void ref_ellipse(Image *im, int32_t cx, int32_t cy, int32_t a) {
    const Ellipse el = foci(im, cx, a);
    const int32_t f = int32_t(xxgluSqrtFx(uint32_t(a * a - (a / 2) * (a / 2)))), t = a + f / 2, k = 2 * a - t;
    auto factor = [&](int32_t x, int32_t y) -> float {
        const int32_t e = int32_t(el.e(x, y, cy));
        if (e > 2 * a) return 0;
        return e <= t ? 1.2f : 1.0f + float(2 * a - e) * 0.2f / float(k) * 0.5f;
    };
    ref_passes(im, cx, cy, std::max(cx - a, 0), std::min(cx + a, im->width - 1), std::max(cy - a / 2, 0),
               std::min(cy + (a + 1) / 2, im->height - 1), factor, false);
}

void ref_circle(Image *im, int32_t cx, int32_t cy, int32_t r) {
    auto factor = [&](int32_t x, int32_t y) -> float {
        const int32_t d = int32_t(distance(x - cx, y - cy));
        if (d > r) return 0;
        return d <= r / 2 ? 1.2f : 1.0f + float(r - d) * 0.2f / float(r - r / 2);
    };
    ref_passes(im, cx, cy, std::max(cx - r, 0), std::min(cx + r, im->width - 1), std::max(cy - r, 0),
               std::min(cy + r, im->height - 1), factor, true);
}

void ref_under_eye(Image *im, int32_t cx, int32_t cy, int32_t strength) {
    const int q = std::clamp(strength, 0, 10) / 10, u = std::max(im->width / 24, 4);
    auto lum = [](uint32_t c) { return (117 * ch(c, 0) + 601 * ch(c, 8) + 306 * ch(c, 16)) >> 10; };
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
                          (c & 0xFF000000u) | ((ch(c, 0) + v) & 255) | ((ch(c, 8) + v) & 255) << 8 |
                              uint32_t((ch(c, 16) + v) & 255) << 16);
        }
}

const int32_t kCentres[][3] = {{12, 10, 7}, {0, 0, 6},  {24, 19, 9}, {-4, 8, 8},  {12, 30, 11},
                               {30, 5, 12}, {5, 9, 40}, {12, 10, 1}, {12, 10, 0}, {6, 6, -5}};

} // namespace

TEST(EyesEnlarge, EllipseAndCircleMatchAccessorVersion) {
    uint32_t seed = 3;
    for (int32_t bc : kBitCounts)
        for (auto [cx, cy, a] : kCentres) {
            Owned pic = random_image(25, 20, bc, seed++);
            Owned ellipse = clone(pic.get()), circle = clone(pic.get());
            Owned refE = clone(pic.get()), refC = clone(pic.get());
            alg_Img_EyesEnlarge(ellipse.get(), cx, cy, a, 1);
            ref_ellipse(refE.get(), cx, cy, a);
            EXPECT_EQ(diff(ellipse.get(), refE.get()), "") << bc << " " << cx << "," << cy << " a" << a;
            alg_Img_EyesEnlarge(circle.get(), cx, cy, a, 0);
            ref_circle(refC.get(), cx, cy, a);
            EXPECT_EQ(diff(circle.get(), refC.get()), "") << bc << " " << cx << "," << cy << " r" << a;
        }
}

TEST(EyesEnlarge, CentreRowAndInnerLowerLeftStay) {
    Owned pic = random_image(60, 60, 24, 11), before = clone(pic.get()), circ = clone(pic.get());
    alg_Img_EyesEnlarge_ellipse(pic.get(), 30, 30, 20);
    alg_Img_EyesEnlarge_circle(circ.get(), 30, 30, 25);
    for (int32_t x = 0; x < 60; ++x)
        EXPECT_EQ(GetPixelColor(pic.get(), x, 30), GetPixelColor(before.get(), x, 30)) << x;
    EXPECT_EQ(GetPixelColor(pic.get(), 30, 29), GetPixelColor(before.get(), 30, 30));
    EXPECT_EQ(GetPixelColor(circ.get(), 24, 36), GetPixelColor(before.get(), 24, 36)); // d = 8 lower left
    EXPECT_NE(GetPixelColor(circ.get(), 36, 36), GetPixelColor(before.get(), 36, 36)); // lower right moves
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
    EXPECT_EQ(EyesEnlarge(blue.get()), 1);
    EXPECT_EQ(diff(blue.get(), before.get()), "");
    EXPECT_EQ(EyesEnlarge(nullptr), 0);
    Owned portrait = load_fixture("portrait-128.bmp");
    EXPECT_EQ(EyesEnlarge(portrait.get()), 1);
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
}

TEST(UnderEye, CrescentCorrection) {
    uint32_t seed = 60;
    for (int32_t bc : kBitCounts)
        for (auto [cx, cy, s] : {std::array{50, 40, 3}, {10, 60, 10}, {95, 5, 12}, {-3, 30, 10}})
            for (int32_t w : {100, 130}) {
                Owned pic = random_image(w, 70, bc, seed++), ref = clone(pic.get());
                alg_Img_quheiyanquan_ellipse(pic.get(), cx, cy, s);
                ref_under_eye(ref.get(), cx, cy, s);
                EXPECT_EQ(diff(pic.get(), ref.get()), "") << bc << " " << cx << "," << cy << " s" << s;
            }
    // Strengths below 10 agree (q = s / 10).
    Owned s0 = random_image(96, 80, 24, 1), s9 = clone(s0.get());
    alg_Img_quheiyanquan_ellipse(s0.get(), 48, 50, 0);
    alg_Img_quheiyanquan_ellipse(s9.get(), 48, 50, 9);
    EXPECT_EQ(diff(s0.get(), s9.get()), "");
}
