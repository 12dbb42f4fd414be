// The wave's height map and render against straightforward versions built on
// Distance2D, tsin and the pixel accessors, including wrapping products.
#include "support/reference_check.hpp"

using namespace pxtest;

namespace {

int stride(int w) { return (w + 3) / 4 * 4; }

// Map entry at (x, y), with the 32-bit products wrapping.
int16_t reference_entry(int x, int y, int w, int h, int cx, int cy, int amp) {
    const uint32_t maxd = Distance2D(std::max(w - cx, cx), std::max(h - cy, cy)), d = Distance2D(x - cx, y - cy);
    const int32_t num = int32_t(uint32_t(tsin(int32_t(d * 360) >> 5)) * uint32_t(amp) * (maxd - d));
    return int16_t(num / int32_t(maxd * 100000u));
}

Owned reference_wave(const Image *src, int amp) {
    const int w = src->width, h = src->height;
    auto m = [&](int x, int y) { return int(reference_entry(x, y, w, h, w >> 1, h >> 1, amp)); };
    Owned out = make(w, h, int(src->bitCount));
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            int sx = x, sy = y;
            if (x > 0 && y > 0 && x < w - 1 && y < h - 1) {
                sx = x + ((m(x - 1, y) + m(x + 1, y)) >> 1), sy = y + ((m(x, y - 1) + m(x, y + 1)) >> 1);
                if (sx < 0 || sx >= w || sy < 0 || sy >= h) sx = x, sy = y;
            }
            SetPixelColor(out.get(), x, y, GetPixelColor(src, sx, sy));
        }
    return out;
}

} // namespace

TEST(Wave, MapMatchesDirectFormula) {
    // Width, height, centre, amplitude: centres far outside the picture, whose
    // squared distances wrap (products that wrap come with the render below).
    const int cases[][5] = {{13, 9, 70000, -3, 8}, {6, 6, -50000, 40000, 1000}, {30, 20, 15, 10, -25}};
    for (auto [w, h, cx, cy, amp] : cases) {
        std::vector<int16_t> map(size_t(stride(w)) * h);
        ASSERT_EQ(create_wave(map.data(), w, h, cx, cy, amp), 1);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                ASSERT_EQ(map[size_t(y) * stride(w) + x], reference_entry(x, y, w, h, cx, cy, amp))
                    << x << "," << y << " of " << w << "x" << h << " amp " << amp;
        // The farthest corner rests when it is a pixel (even sizes around the centre).
        EXPECT_TRUE(map[0] == 0 || w % 2 || h % 2 || cx != w / 2 || cy != h / 2);
    }
}

TEST(Wave, RenderMatchesAccessorVersion) {
    uint32_t seed = 7;
    for (int amp : {0, 3, -12, 40, 2000})
        expect_like_reference([amp](Image *s, Image **d) { return Wave_Transform(s, d, amp); },
                              [amp](const Image *s) { return amp == 0 ? clone(s) : reference_wave(s, amp); },
                              seed += 100);
}
