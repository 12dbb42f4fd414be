// Sketch and photocopy against straightforward versions that follow the
// plane-by-plane recipe literally, plus hand-checked cases.
#include <gtest/gtest.h>

#include <vector>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

uint8_t gray(uint32_t c) { return uint8_t((117 * ((c >> 16) & 255) + 601 * ((c >> 8) & 255) + 306 * (c & 255)) >> 10); }

// Planes G, E, B, N in one zeroed block, exactly as the recipe lays them out.
Owned reference_sketch(const Image *src, bool edges) {
    const int32_t w = src->width, h = src->height;
    const size_t n = size_t(w) * h;
    std::vector<uint8_t> buf(n * 4 + 1, 0);
    uint8_t *G = buf.data(), *E = G + n, *B = G + 2 * n, *N = G + 3 * n;
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            G[y * w + x] = gray(GetPixelColor(src, x, y));
    const int32_t k1[9] = {1, 1, 1, 0, 0, 0, -1, -1, -1}, k2[9] = {1, 0, -1, 1, 0, -1, 1, 0, -1};
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const int g1 = std::abs(temp_ex(G, w, h, k1, 3, y, x)), g2 = std::abs(temp_ex(G, w, h, k2, 3, y, x));
            E[y * w + x] = uint8_t(~std::max(g1, g2));
            N[y * w + x] = uint8_t(255 - G[y * w + x]);
        }
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            if (y == 0 || x == 0 || y == h - 1 || x == w - 1) {
                B[y * w + x] = 0;
                continue;
            }
            int s = 0;
            for (int dy = -1; dy <= 1; ++dy)
                for (int dx = -1; dx <= 1; ++dx)
                    s += N[(y + dy) * w + x + dx];
            B[y * w + x] = uint8_t(int(s / 9.3));
        }
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const int a = G[y * w + x], b = B[y * w + x];
            const int v = a + a * b / (256 - b);
            int t = int(float(v) * float(double(v * v) / 255.0 / 255.0));
            if (t > 255) t = 255;
            if (edges && E[y * w + x] < t && a < 170) t = E[y * w + x];
            SetPixelColor(out.get(), x, y, uint32_t(t) * 0x010101u);
        }
    return out;
}

Owned reference_photocopy(const Image *src) {
    const int32_t w = src->width, h = src->height;
    std::vector<int> G(size_t(w) * h), U(G.size()), Q(G.size());
    std::vector<int64_t> H(2000);
    int64_t dark = 0, bright = 0;
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            G[y * w + x] = gray(GetPixelColor(src, x, y));
    const int wt[5] = {1, 2, 4, 2, 1};
    for (int32_t y = 2; y < h - 2; ++y)
        for (int32_t x = 2; x < w - 2; ++x) {
            int s = 0, u = 0;
            for (int dy = -2; dy <= 2; ++dy)
                for (int dx = -2; dx <= 2; ++dx) {
                    s += G[(y + dy) * w + x + dx];
                    u += wt[dy + 2] * wt[dx + 2] * G[(y + dy) * w + x + dx];
                }
            const int m = s / 25;
            U[y * w + x] = u / 100;
            if (m == 0) continue;
            const int q = U[y * w + x] * 1000 / m;
            Q[y * w + x] = q & 0xFFFF;
            if (q < 990)
                ++dark, ++H[q];
            else if (q <= 1999)
                ++bright, ++H[q];
        }
    int t1 = 0, t2 = 1000;
    int64_t cum = 0;
    for (int i = 0; i < 990; ++i)
        if ((cum += H[i]) * 1000 > dark * 200) {
            t1 = 990 - i;
            break;
        }
    cum = 0;
    for (int i = 990; i < 2000; ++i)
        if ((cum += H[i]) * 1000 > bright * 800) {
            t2 = i - 990;
            break;
        }
    for (int32_t y = 1; y < h - 1; ++y)
        for (int32_t x = 1; x < w - 1; ++x) {
            const int q = Q[y * w + x], u = U[y * w + x];
            if (q == 0) continue;
            int v;
            if (q < 990) {
                const int k = t1 == 0 ? 0 : (t1 - std::min(990 - q, t1)) * 1000 / t1;
                v = std::clamp(u * k / 1000, 0, 255);
            } else {
                const int k = t2 == 0 ? 1000 : std::min(q - 990, t2) * 1000 / t2;
                v = std::min(255 - (255 - u) * (1000 - k) / 1000, 255);
            }
            G[y * w + x] = v;
        }
    Owned out = make(w, h, static_cast<int32_t>(src->bitCount));
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x)
            SetPixelColor(out.get(), x, y, uint32_t(G[y * w + x]) * 0x010101u);
    PX_Img_CopyAlpha(out.get(), src);
    return out;
}

// A picture with smooth areas and edges, so that every branch is reached.
Owned scene(int32_t w, int32_t h, int32_t bc, uint32_t seed) {
    Owned im = random_image(w, h, bc, seed);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w / 2; ++x) {
            const uint32_t v = uint32_t((x * 7 + y * 3) & 255);
            SetPixelColor(im.get(), x, y, (v * 0x010101u) | ((seed & 1) ? 0x80000000u : 0));
        }
    return im;
}

const int32_t kSizes[][2] = {{1, 1}, {1, 5}, {5, 1}, {2, 3}, {4, 4}, {5, 5}, {6, 9}, {31, 17}, {64, 48}};

} // namespace

TEST(Sketch, MatchesPlaneRecipeOnEveryFormat) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = scene(w, h, bc, seed++);
            Slot a, b;
            ASSERT_EQ(PX_IMG_Sketch(src.get(), &a), 1u);
            ASSERT_EQ(PX_IMG_Sketch_1(src.get(), &b), 1u);
            EXPECT_EQ(diff(a.get(), reference_sketch(src.get(), true).get()), "") << w << "x" << h << "@" << bc;
            EXPECT_EQ(diff(b.get(), reference_sketch(src.get(), false).get()), "") << w << "x" << h << "@" << bc;
        }
}

TEST(Sketch, UniformGrayAndTransparentOutput) {
    Owned src = filled(6, 6, 32, 0xFF646464); // gray 100
    Slot dst;
    ASSERT_EQ(PX_IMG_Sketch_1(src.get(), &dst), 1u);
    // Border: blur 0, so the cube law of a itself: trunc(100 * (100*100/65025)).
    const int border = int(float(100) * float(10000.0 / 255.0 / 255.0));
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 3), uint32_t(border) * 0x010101u); // alpha 0
    const int b = int(9 * 155 / 9.3), v = 100 + 100 * b / (256 - b);
    const int inner = std::min(255, int(float(v) * float(double(v * v) / 255.0 / 255.0)));
    EXPECT_EQ(GetPixelColor(dst.get(), 2, 2), uint32_t(inner) * 0x010101u);
}

TEST(Sketch, TempExReadsOneColumnPastTheRow) {
    const uint8_t plane[2 * 3 + 1] = {1, 2, 3, 40, 50, 60, 99};
    const int32_t right[9] = {0, 0, 0, 0, 0, 0, 0, 1, 0}; // the centre row of the right column
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 0, 2), 40);  // column 3 of row 0 is row 1's first byte
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 1, 2), 99);  // the byte after the plane
    const int32_t ones[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
    EXPECT_EQ(temp_ex(plane, 3, 2, ones, 3, 0, 0), 1 + 2 + 40 + 50);
}

TEST(Photocopy, MatchesRecipeOnEveryFormat) {
    uint32_t seed = 50;
    for (int32_t bc : kBitCounts)
        for (auto [w, h] : kSizes) {
            Owned src = scene(w, h, bc, seed++);
            Slot dst;
            ASSERT_EQ(PX_IMG_Photocopy(src.get(), &dst), 1u);
            EXPECT_EQ(diff(dst.get(), reference_photocopy(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
}

TEST(Photocopy, UniformAndSmallPictures) {
    Owned flat = filled(8, 8, 32, 0x40505050);
    Slot dst;
    ASSERT_EQ(PX_IMG_Photocopy(flat.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 3, 3), 0x40FFFFFFu); // bright interior turns white, alpha kept
    EXPECT_EQ(GetPixelColor(dst.get(), 1, 1), 0x40000000u | gray(0x505050) * 0x010101u);
    Owned black = filled(8, 8, 24, 0);
    ASSERT_EQ(PX_IMG_Photocopy(black.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 4, 4), 0xFF000000u);
    Owned small = random_image(4, 9, 32, 77); // too narrow for statistics: plain gray
    ASSERT_EQ(PX_IMG_Photocopy(small.get(), &dst), 1u);
    for (int32_t y = 0; y < 9; ++y)
        for (int32_t x = 0; x < 4; ++x) {
            const uint32_t c = GetPixelColor(small.get(), x, y);
            EXPECT_EQ(GetPixelColor(dst.get(), x, y), (c & 0xFF000000u) | gray(c) * 0x010101u);
        }
}
