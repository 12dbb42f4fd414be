// Polar transforms against a straightforward accessor version (the bathroom
// ribs among them), and the mirrored identity and the outside colour.
#include "support/reference_check.hpp"

using namespace pxtest;

namespace {

Owned reference_circle(const Image *src, int mode, int radius, float factor) {
    const int w = src->width, h = src->height, cx = w / 2, cy = h / 2;
    const int R = radius != 0 ? radius : int(std::sqrt(double(float(cx * cx + cy * cy))));
    Owned out = make(w, h, int(src->bitCount));
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            const int dx = cx - x, dy = cy - y;
            const double r = std::sqrt(double(float(dx * dx + dy * dy))), t = std::atan2(dy, dx);
            int sx = -1, sy = -1;
            if (r < R && mode >= 4) {
                sx = x + x % 32 - 16, sy = y;
            } else if (r < R && mode == 3) {
                sx = int(std::fabs(t * w / 6.2831852)), sy = int(std::fabs(r * h / R));
            } else if (r < R) {
                const double rr = mode == 1 ? std::sqrt(r * R) : mode == 2 ? r : r * r / R;
                const double tt = mode == 2 ? t + r / (factor == 0.0f ? 1.0 : factor) : t;
                sx = cx + int(rr * std::cos(tt)), sy = cy - int(rr * std::sin(tt));
            }
            SetPixelColor(out.get(), x, y, GetPixelColor(src, sx, sy));
        }
    return out;
}

} // namespace

TEST(Polar, MatchesAccessorVersion) {
    // Mode, radius and factor; a negative mode behaves as the punch (the
    // named entry points, whose outputs the golden hashes pin, pass fixed ones).
    const float cases[][3] = {{9, 0, 1},   {-3, 0, 1}, {2, 0, 0},  {2, 7, -3.5f}, {0, 500, 1},
                              {1, 500, 1}, {3, 9, 1},  {4, -5, 1}, {3, 0, 100}};
    for (int i = 0; i < 9; ++i) {
        const int mode = int(cases[i][0]), radius = int(cases[i][1]);
        const float factor = cases[i][2];
        expect_like_reference([&](Image *s, Image **d) { return CircleTransform(s, d, mode, radius, factor); },
                              [&](const Image *s) { return reference_circle(s, std::max(0, mode), radius, factor); },
                              uint32_t(100 * i));
    }
}

TEST(Polar, MirroredIdentityAndOutsideColour) {
    Owned src = make(100, 31, 32); // pixel (x, y) holds x in blue and y in green
    for (int y = 0; y < 31; ++y)
        for (int x = 0; x < 100; ++x)
            SetPixelColor(src.get(), x, y, 0xFF000000u | uint32_t(y) << 8 | uint32_t(x));
    Slot dst;
    // A swirl with a vanishing twist maps (x, y) onto (2 cx - x, y), exactly on
    // the centre row and column and up to rounding elsewhere; outside, pixel (0, 0).
    ASSERT_EQ(CircleTransform(src.get(), &dst, 2, 40, 1e30f), 1u);
    for (int y = 0; y < 31; ++y)
        for (int x = 0; x < 100; ++x) {
            const uint32_t c = GetPixelColor(dst.get(), x, y), in = std::hypot(50 - x, 15 - y) < 40;
            EXPECT_NEAR(int(c & 255), in * (100 - x), x == 50 || y == 15 ? 0 : 1) << x << "," << y;
            EXPECT_NEAR(int(c >> 8 & 255), in * y, x == 50 || y == 15 ? 0 : 1) << x << "," << y;
        }
}
