// Polar transforms against a straightforward accessor version, and the
// mirrored identity, the outside colour and the bathroom ribs.
#include <gtest/gtest.h>

#include <cmath>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

Owned reference_circle(const Image *src, int mode, int radius, float factor) {
    const int w = src->width, h = src->height, cx = w / 2, cy = h / 2;
    const int R = radius != 0 ? radius : int(std::sqrt(double(float(cx * cx + cy * cy))));
    const double f = factor == 0.0f ? 1.0 : factor;
    Owned out = make(w, h, int(src->bitCount));
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            const int dx = cx - x, dy = cy - y;
            const double r = std::sqrt(double(float(dx * dx + dy * dy)));
            int sx = -1, sy = -1;
            if (r < R) {
                const double t = std::atan2(double(dy), double(dx));
                if (mode >= 4) {
                    sx = x + x % 32 - 16, sy = y;
                } else if (mode == 3) {
                    sx = int(std::fabs(t * w / 6.2831852)), sy = int(std::fabs(r * h / R));
                } else {
                    const double rr = mode == 1 ? std::sqrt(r * R) : mode == 2 ? r : r * r / R;
                    const double tt = mode == 2 ? t + r / f : t;
                    sx = cx + int(rr * std::cos(tt)), sy = cy - int(rr * std::sin(tt));
                }
            }
            SetPixelColor(out.get(), x, y, GetPixelColor(src, sx, sy));
        }
    return out;
}

// A 32-bit picture whose pixel (x, y) holds x in blue and y in green.
Owned coordinates(int w, int h) {
    Owned im = make(w, h, 32);
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x)
            SetPixelColor(im.get(), x, y, 0xFF000000u | uint32_t(y) << 8 | uint32_t(x));
    return im;
}

} // namespace

TEST(Polar, MatchesAccessorVersion) {
    const int sizes[][2] = {{1, 1}, {1, 7}, {7, 1}, {2, 2}, {5, 4}, {33, 20}, {64, 47}};
    const struct {
        int mode, radius;
        float factor;
    } cases[] = {{0, 0, 100}, {1, 0, 100},   {2, 0, 100}, {3, 0, 100}, {4, 0, 1}, {9, 0, 1}, {-3, 0, 1},
                 {2, 0, 0},   {2, 7, -3.5f}, {0, 500, 1}, {1, 500, 1}, {3, 9, 1}, {4, -5, 1}};
    uint32_t seed = 1;
    for (int bc : kBitCounts)
        for (auto [w, h] : sizes)
            for (auto c : cases) {
                Owned src = random_image(w, h, bc, seed++);
                Slot dst;
                ASSERT_EQ(CircleTransform(src.get(), &dst, c.mode, c.radius, c.factor), 1u);
                // A negative mode behaves as the punch.
                const Owned want = reference_circle(src.get(), c.mode < 0 ? 0 : c.mode, c.radius, c.factor);
                EXPECT_EQ(diff(dst.get(), want.get()), "") << w << "x" << h << "@" << bc << " mode " << c.mode;
            }
}

TEST(Polar, MirroredIdentityInsideAndCornerOutside) {
    Owned src = coordinates(41, 30);
    Slot dst;
    // A swirl with a vanishing twist maps (x, y) onto (2 cx - x, y), up to rounding.
    ASSERT_EQ(CircleTransform(src.get(), &dst, 2, 0, 1e30f), 1u);
    for (int y = 0; y < 30; ++y)
        for (int x = 0; x < 41; ++x) {
            const uint32_t c = GetPixelColor(dst.get(), x, y);
            if (x == 0 && y == 0) {
                EXPECT_EQ(c, GetPixelColor(src.get(), 0, 0));
            }
            if (std::hypot(20 - x, 15 - y) >= 25) continue;
            EXPECT_NEAR(int(c & 255), 40 - x, x == 20 || y == 15 ? 0 : 1) << x << "," << y;
            EXPECT_NEAR(int(c >> 8 & 255), y, x == 20 || y == 15 ? 0 : 1) << x << "," << y;
        }
}

TEST(Polar, BathroomRibsAndRefusals) {
    Owned src = coordinates(100, 3);
    Slot dst;
    ASSERT_EQ(CircleTransform(src.get(), &dst, 4, 1000, 1), 1u);
    const int want[][2] = {{0, 0}, {15, 14}, {16, 16}, {31, 46}, {32, 16}, {63, 78}, {99, 86}};
    for (auto [x, sx] : want)
        EXPECT_EQ(GetPixelColor(dst.get(), x, 1), GetPixelColor(src.get(), sx, 1)) << x;
    // Every pixel lies outside a negative radius: all take pixel (0, 0).
    ASSERT_EQ(CircleTransform(src.get(), &dst, 4, -1, 1), 1u);
    for (int x = 0; x < 100; ++x)
        EXPECT_EQ(GetPixelColor(dst.get(), x, 2), 0xFF000000u);
    EXPECT_EQ(Bathroom_Transform(nullptr, &dst), 0u);
    EXPECT_EQ(Punch_Transform(src.get(), nullptr), 0u);
}

TEST(Polar, EntryPointsFixModeAndFactor) {
    Owned src = random_image(40, 30, 24, 5);
    const struct {
        uint32_t (*fn)(Image *, Image **);
        int mode;
        float factor;
    } entries[] = {{Punch_Transform, 0, 100},
                   {Pinch_Transform, 1, 100},
                   {Swirl_Transform, 2, 100},
                   {Cylinder_Transform, 3, 100},
                   {Bathroom_Transform, 4, 1}};
    for (auto e : entries) {
        Slot a, b;
        ASSERT_EQ(e.fn(src.get(), &a), 1u);
        ASSERT_EQ(CircleTransform(src.get(), &b, e.mode, 0, e.factor), 1u);
        EXPECT_EQ(diff(a.get(), b.get()), "") << e.mode;
    }
}
