// Sketch and photocopy against straightforward versions that follow the
// plane-by-plane recipe literally.
#include "support/reference_check.hpp"

using namespace pxtest;

namespace {

int gray(uint32_t c) { return (117 * chan(c, 16) + 601 * chan(c, 8) + 306 * chan(c, 0)) >> 10; }

Owned gray_out(const Image *src, const std::vector<int> &g) {
    return per_pixel(src, [&](uint32_t, int x, int y) { return uint32_t(g[y * src->width + x]) * 0x010101u; });
}

// Planes G, E, B, N in one zeroed block, exactly as the recipe lays them out.
Owned reference_sketch(const Image *src, bool edges) {
    const int32_t w = src->width, h = src->height, n = w * h;
    std::vector<uint8_t> buf(size_t(n) * 4 + 1, 0);
    uint8_t *G = buf.data(), *E = G + n, *B = G + 2 * n, *N = G + 3 * n;
    for (int32_t i = 0; i < n; ++i)
        G[i] = uint8_t(gray(GetPixelColor(src, i % w, i / w))), N[i] = uint8_t(255 - G[i]);
    const int32_t k1[9] = {1, 1, 1, 0, 0, 0, -1, -1, -1}, k2[9] = {1, 0, -1, 1, 0, -1, 1, 0, -1};
    std::vector<int> out(n);
    for (int32_t y = 0; y < h; ++y)
        for (int32_t x = 0; x < w; ++x) {
            const int i = y * w + x, g1 = std::abs(temp_ex(G, w, h, k1, 3, y, x));
            E[i] = uint8_t(~std::max(g1, std::abs(temp_ex(G, w, h, k2, 3, y, x))));
            if (y == 0 || x == 0 || y == h - 1 || x == w - 1) continue; // blur 0
            int s = 0;
            for (int d = 0; d < 9; ++d)
                s += N[i + (d / 3 - 1) * w + d % 3 - 1];
            B[i] = uint8_t(int(s / 9.3));
        }
    for (int32_t i = 0; i < n; ++i) {
        const int a = G[i], v = a + a * B[i] / (256 - B[i]);
        out[i] = std::min(int(float(v) * float(double(v * v) / 255.0 / 255.0)), 255);
        if (edges && E[i] < out[i] && a < 170) out[i] = E[i];
    }
    return gray_out(src, out);
}

Owned reference_photocopy(const Image *src) {
    const int32_t w = src->width, h = src->height;
    std::vector<int> G(size_t(w) * h), U(G.size()), Q(G.size());
    std::vector<int64_t> H(2000);
    int64_t dark = 0, bright = 0, cum = 0;
    for (int32_t i = 0; i < w * h; ++i)
        G[i] = gray(GetPixelColor(src, i % w, i / w));
    const int wt[5] = {1, 2, 4, 2, 1};
    for (int32_t y = 2; y < h - 2; ++y)
        for (int32_t x = 2; x < w - 2; ++x) {
            int s = 0, u = 0;
            for (int d = 0; d < 25; ++d) {
                s += G[(y + d / 5 - 2) * w + x + d % 5 - 2];
                u += wt[d / 5] * wt[d % 5] * G[(y + d / 5 - 2) * w + x + d % 5 - 2];
            }
            U[y * w + x] = u / 100;
            if (s / 25 == 0) continue;
            const int r = u / 100 * 1000 / (s / 25);
            Q[y * w + x] = r & 0xFFFF;
            if (r < 2000) ++(r < 990 ? dark : bright), ++H[r];
        }
    int i = 0; // thresholds: 20 % of the dark ratios, 80 % of the bright ones
    while (i < 990 && (cum += H[i]) * 1000 <= dark * 200)
        ++i;
    const int t1 = i < 990 ? 990 - i : 0;
    for (cum = 0, i = 990; i < 2000 && (cum += H[i]) * 1000 <= bright * 800;)
        ++i;
    const int t2 = i < 2000 ? i - 990 : 1000;
    for (int32_t y = 1; y < h - 1; ++y)
        for (int32_t x = 1; x < w - 1; ++x) {
            const int q = Q[y * w + x], u = U[y * w + x];
            const int k = q < 990 ? (t1 == 0 ? 0 : (t1 - std::min(990 - q, t1)) * 1000 / t1)
                                  : (t2 == 0 ? 1000 : std::min(q - 990, t2) * 1000 / t2);
            if (q != 0) G[y * w + x] = std::clamp(q < 990 ? u * k / 1000 : 255 - (255 - u) * (1000 - k) / 1000, 0, 255);
        }
    Owned out = gray_out(src, G);
    PX_Img_CopyAlpha(out.get(), src);
    return out;
}

} // namespace

TEST(SketchPhotocopy, MatchRecipesOnEveryFormat) {
    uint32_t seed = 1;
    for (int32_t bc : kBitCounts)
        for (const auto &[w, h] : kAwkwardSizes) {
            // Smooth areas, a black block and noise, so that every branch is reached.
            Owned src = random_image(w, h, bc, ++seed);
            for (int32_t y = 0; y < h; ++y)
                for (int32_t x = 0; x < w * 3 / 4; ++x)
                    SetPixelColor(src.get(), x, y, x < w / 2 ? ((x * 7 + y * 3) & 255) * 0x010101u | seed << 31 : 0);
            Slot a, b, c;
            ASSERT_EQ(PX_ProcessImage(src.get(), &a, 3) + PX_IMG_Sketch_1(src.get(), &b), 2u);
            ASSERT_EQ(PX_ProcessImage(src.get(), &c, 2), 1u);
            EXPECT_EQ(diff(a.get(), reference_sketch(src.get(), true).get()), "") << w << "x" << h << "@" << bc;
            EXPECT_EQ(diff(b.get(), reference_sketch(src.get(), false).get()), "") << w << "x" << h << "@" << bc;
            EXPECT_EQ(diff(c.get(), reference_photocopy(src.get()).get()), "") << w << "x" << h << "@" << bc;
        }
}

TEST(SketchPhotocopy, TempExReadsOneColumnPastTheRow) {
    const uint8_t plane[2 * 3 + 1] = {1, 2, 3, 40, 50, 60, 99};
    const int32_t right[9] = {0, 0, 0, 0, 0, 0, 0, 1, 0}, ones[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 0, 2), 40); // column 3 of row 0 is row 1's first byte
    EXPECT_EQ(temp_ex(plane, 3, 2, right, 3, 1, 2), 99); // the byte after the plane
    EXPECT_EQ(temp_ex(plane, 3, 2, ones, 3, 0, 0), 1 + 2 + 40 + 50);
}

// A slot holding the source itself: the result is written over the source
// opaque, and the alpha then copied onto itself stays 255.
TEST(SketchPhotocopy, InPlaceResultIsOpaque) {
    Owned src = random_image(33, 17, 32, 77);
    Owned expected = reference_photocopy(src.get());
    for (int32_t y = 0; y < 17; ++y)
        for (int32_t x = 0; x < 33; ++x)
            SetPixelColor(expected.get(), x, y, GetPixelColor(expected.get(), x, y) | 0xFF000000u);
    Image *img = src.get();
    ASSERT_EQ(PX_ProcessImage(img, &img, 2), 1u);
    ASSERT_EQ(img, src.get());
    EXPECT_EQ(diff(img, expected.get()), "");
}
