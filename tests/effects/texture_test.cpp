// Mosaic, watercolour jitter, oil painting and plane quantisation (the
// posterised oil, without parameters, is pinned by the golden hashes).
#include "support/reference_check.hpp"

using namespace pxtest;

namespace {

// Rescans the whole window of every interior pixel; interior alpha is the source's.
Owned ref_oil(const Image *src, int r) {
    const int w = src->width, h = src->height;
    return per_pixel(src, [&](uint32_t c, int x, int y) {
        if (x < r || x >= w - r || y < r || y >= h - r) return c;
        long n[8] = {}, sum[8][3] = {};
        for (int yy = y - r; yy <= y + r; ++yy)
            for (int xx = x - r; xx <= x + r; ++xx) {
                const uint32_t p = GetPixelColor(src, xx, yy);
                const int k = (306 * chan(p, 16) + 601 * chan(p, 8) + 117 * chan(p, 0)) >> 15;
                ++n[k];
                for (int i = 0; i < 3; ++i)
                    sum[k][i] += chan(p, 8 * i);
            }
        const int k = int(std::max_element(n, n + 8) - n); // first maximum
        return rgba(int(sum[k][0] / n[k]), int(sum[k][1] / n[k]), int(sum[k][2] / n[k]), chan(c, 24));
    });
}

} // namespace

TEST(Texture, MosaicBlocksSampleTheirCentreOrHalfwayToTheEdge) {
    for (int n : {1, 2, 3, 4, 7, 40, INT32_MAX}) {
        const auto ref = [n](const Image *s) {
            const int w = s->width, h = s->height, half = n / 2;
            return per_pixel(s, [&](uint32_t, int x, int y) {
                const int bx = x - x % n + half, by = y - y % n + half;
                return GetPixelColor(s, bx < w ? bx : (w - half + bx) >> 1, by < h ? by : (by - half + h) >> 1);
            });
        };
        expect_like_reference([n](Image *s, Image **d) { return PX_IMG_Mosaic(s, d, n); }, ref, 7u * n);
    }
    // n <= 0, after the result rule: no block size (0), or a row of
    // (width + n - 1) / n block colours, which only a picture one pixel wide
    // has; its pixels take the colour at (n / 2, y0 + n / 2), clamped, refilled
    // every -n rows from y0.
    Owned column = random_image(1, 7, 32, 3), wide = random_image(2, 7, 32, 4);
    for (int n : {-1, -3, INT32_MIN}) {
        Slot dst;
        ASSERT_EQ(PX_IMG_Mosaic(column.get(), &dst, n), 1u);
        for (int y = 0; y < 7; ++y) {
            const int y0 = y - y % n;
            EXPECT_EQ(GetPixelColor(dst.get(), 0, y), GetPixelColor(column.get(), 0, y0 + n / 2)) << n << " " << y;
        }
    }
    for (int n : {0, -1, -3}) {
        Slot dst;
        ASSERT_EQ(PX_IMG_Mosaic(wide.get(), &dst, n), 0u);
        EXPECT_EQ(diff(dst.get(), make(2, 7, 32).get()), "") << n; // prepared, unwritten
    }
}

// Two draws per pixel in this order; a negative draw resets the horizontal jitter only.
TEST(Texture, AquarelleSeededJitterAndItsSignRule) {
    for (int32_t range : {1, 5, 0, -3, INT32_MIN, INT32_MAX}) {
        const auto ref = [range](const Image *s) {
            srand48(5);
            return per_pixel(s, [&](uint32_t, int x, int y) {
                const int64_t a = PX_rand(range), b = PX_rand(range);
                return GetPixelColor(s, int32_t(std::clamp<int64_t>(a < 0 || b < 0 ? x : x + a, 0, s->width - 1)),
                                     int32_t(std::clamp<int64_t>(y + b, 0, s->height - 1)));
            });
        };
        expect_like_reference([range](Image *s, Image **d) { return srand48(5), PX_IMG_Aquarelle(s, d, range); }, ref,
                              1);
    }
}

TEST(Texture, OilMatchesWindowRescanAndCopiesTheBorder) {
    uint32_t seed = 900;
    // 16-bit window sums up to radius 7, 32-bit beyond; rows of interior
    // pixels run in chunks of 64, so the widest picture takes several.
    std::vector<std::pair<int32_t, int32_t>> sizes{{150, 17}};
    for (const auto &[w, h] : kAwkwardSizes)
        sizes.emplace_back(w, h);
    for (int r : {0, 1, 2, 3, 7, 8})
        for (int32_t bc : kBitCounts)
            for (const auto &[w, h] : sizes) {
                Owned src = random_image(w, h, bc, seed++);
                Slot dst;
                const bool fits = 2 * r < w && 2 * r < h;
                ASSERT_EQ(imOil(src.get(), &dst, r), fits ? 1u : 0u);
                // A negative radius has no window: refused after the result rule.
                Slot prepared;
                ASSERT_EQ(imOil(src.get(), &prepared, -1 - r), 0u);
                EXPECT_EQ(diff(prepared.get(), make(w, h, bc).get()), "");
                if (fits) {
                    EXPECT_EQ(diff(dst.get(), ref_oil(src.get(), r).get()), "") << w << "x" << h << "@" << bc;
                }
            }
    // A window of 4105^2 white pixels sums 255 * 4105^2 > 2^32 per channel:
    // the one interior pixel stays white only with 64-bit sums.
    Owned white = filled(4105, 4105, 24, 0xFFFFFF);
    Slot dst;
    ASSERT_EQ(imOil(white.get(), &dst, 2052), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 2052, 2052) & 0xFFFFFFu, 0xFFFFFFu);
}

// 3 levels: groups 0..85, 86..171, 172..255; 12 levels: groups of 22, the last
// one 242..255. A tie keeps the first value; padding bytes (255) are neither
// counted nor changed.
TEST(Texture, ColorCompressMapsGroupsToTheirMostFrequentMember) {
    const std::vector<uint8_t> in[2] = {{0, 85, 85, 40, 86, 171, 171, 90, 172, 255, 200, 200}, {250, 243}};
    const std::vector<uint8_t> out[2] = {{85, 85, 85, 85, 171, 171, 171, 171, 200, 200, 200, 200},
                                         {243, 243, 255, 255}};
    for (int i = 0; i < 2; ++i) {
        Owned plane = make(int32_t(in[i].size()), 1, 8);
        std::copy(in[i].begin(), in[i].end(), plane->bits);
        ASSERT_EQ(ColorCompress(plane.get(), i == 0 ? 3 : 12), 1);
        EXPECT_EQ(std::vector<uint8_t>(plane->bits, plane->bits + plane->pitch), out[i]);
    }
}
