// Sharpening, smoothing, edges, the sort and the two effects against
// brute-force versions on awkward sizes of every supported format.
#include "toolkit/px_images.hpp"

using namespace pxtest;

namespace {

const int kSizes[][2] = {{1, 1}, {1, 9}, {9, 1}, {2, 3}, {8, 8}, {13, 7}, {6, 60}, {37, 5}};

std::vector<int> sharpen_kernel(int strength) {
    if (strength < 40) return {0, -1, 0, -1, 5, -1, 0, -1, 0};
    if (strength < 80) return {0, -1, -1, -1, 0, -1, 0, 1, 0, -1, -1, 1, 9, 1, -1, -1, 0, 1, 0, -1, 0, -1, -1, -1, 0};
    std::vector<int> k(49, -1);
    k[24] = 49;
    return k;
}

// Applies `value(window samples in kernel order)` at every output position
// from source row `first`, into row y - first; other rows keep their bytes.
template <class Fn> PX brute(const PXImage *src, int size, int first, Fn value) {
    PX out = px_clone(src);
    const int ch = src->bitcount == 24 ? 3 : 1, half = size / 2;
    for (int y = first; y < src->height; ++y)
        for (int x = 0; x < src->width; ++x)
            for (int c = 0; c < ch; ++c) {
                std::vector<int> win;
                for (int dy = -half; dy <= half; ++dy)
                    for (int dx = -half; dx <= half; ++dx)
                        win.push_back(neighbour(src, y, x, dy, dx, c));
                put_sample(out.get(), y - first, x, c, value(win));
            }
    return out;
}

int limit(const PXImage *im, int v) { return std::clamp(v, 0, im->bitcount == 16 ? 65535 : 255); }

int weighted(const std::vector<int> &win, const std::vector<int> &k) {
    return std::inner_product(win.begin(), win.end(), k.begin(), 0);
}

// Edge detection runs at strength -3 in place of sharpening; Sharpen leaves
// a picture alone above 100.
TEST(Filters, SharpenSmoothAndEdgesMatchBruteForceWindows) {
    const std::vector<int> edge = {1, 0, -1, 2, 0, -2, 1, 1, -1};
    for (int bits : {8, 16, 24})
        for (const auto &sz : kSizes)
            for (int strength : {-3, 19, 20, 39, 40, 60, 79, 80, 100, 1000}) {
                PX src = px_random(sz[0], sz[1], bits, uint32_t(sz[0] * 31 + sz[1] * 17 + strength));
                for (size_t i = 0; strength % 20 == 0 && i < px_size(src.get()); ++i)
                    src->data[i] &= 0x81; // few levels: windows full of ties
                const auto k = strength == -3 ? edge : sharpen_kernel(strength);
                const int size = int(std::sqrt(double(k.size())));
                PX sharp = strength > 100 ? px_clone(src.get())
                                          : brute(src.get(), size, size == 7 ? 49 : 0, [&](const std::vector<int> &w) {
                                                return limit(src.get(), weighted(w, k) >> (strength == -3 ? 2 : 0));
                                            });
                const int smoothSize = std::array{3, 5, 7, 5, 7}[std::clamp(strength, 0, 80) / 20]; // mean, then median
                PX smooth = brute(src.get(), smoothSize, 0, [&](std::vector<int> w) {
                    if (strength < 60) return weighted(w, std::vector<int>(w.size(), 1)) / int(w.size());
                    std::sort(w.begin(), w.end());
                    return w[w.size() / 2];
                });
                SCOPED_TRACE(std::to_string(bits) + " bits, strength " + std::to_string(strength));
                PX s1 = px_clone(src.get());
                ASSERT_EQ(strength == -3 ? PXImage_EdgeDetection(s1.get()) : PXImage_Sharpen(s1.get(), strength), 1);
                ASSERT_EQ(PXImage_Smooth(src.get(), strength), 1);
                EXPECT_EQ(bytes(s1.get()), bytes(sharp.get())) << sz[0] << "x" << sz[1];
                EXPECT_EQ(bytes(src.get()), bytes(smooth.get())) << sz[0] << "x" << sz[1];
            }
    // Strength 0 is refused; no kernel above 100: done for a record with
    // data, also of no rows.
    PX img = px_random(5, 5, 8, 1);
    PXImage rowless{0, 7, 8, img->data}, hollow{9, 7, 8, nullptr};
    EXPECT_EQ(PXImage_Sharpen(img.get(), 0) + PXImage_Smooth(img.get(), 0), 0);
    EXPECT_EQ(PXImage_Sharpen(&rowless, 101) * 10 + PXImage_Sharpen(&hollow, 101), 10);
}

TEST(Sort, PartitionExchangeOnAdversarialInputs) {
    std::mt19937 rng(5);
    for (int kind = 0; kind < 5; ++kind) { // sorted, reversed, equal, random, alternating extremes
        std::vector<int32_t> v(4000);
        for (int i = 0; i < 4000; ++i) {
            const int32_t values[] = {i, 4000 - i, 7, int32_t(rng()), i % 2 ? INT32_MIN + i : INT32_MAX - i};
            v[i] = values[kind];
        }
        auto want = v;
        std::sort(want.begin(), want.end());
        px_ShellSort(v.data(), 0, 3999);
        EXPECT_EQ(v, want);
    }
    std::vector<int32_t> part = {5, 4, 3, 2, 1, 0};
    px_ShellSort(part.data(), 1, 4);
    EXPECT_EQ(part, (std::vector<int32_t>{5, 1, 2, 3, 4, 0}));
}

TEST(Clip, PhotoShowsThroughDarkHolesInsideTheWindow) {
    PX frame = px_random(720, 566, 24, 4);
    for (size_t i = 2; i < px_size(frame.get()); i += 3)
        if (frame->data[i] < 40) frame->data[i] = uint8_t(frame->data[i] % 8); // some holes, and level 7
    for (int bits : {8, 24}) {
        PX photo = px_random(700, 300, bits, 6); // shorter than the window
        PX out(PXImage_Effect_Clip(photo.get(), frame.get()));
        ASSERT_TRUE(out);
        for (int y = 0; y < 566; ++y)
            for (int x = 0; x < 720; ++x) {
                const uint8_t *f = frame->data + (y * 720 + x) * 3, *o = out->data + (y * 720 + x) * 3;
                const size_t p = size_t(y - 50) * 700 + (x - 40);
                const bool shown = y >= 50 && y < 564 && x >= 40 && x < 718 && f[2] < 7 && p < 700 * 300;
                for (int c = 0; c < 3; ++c)
                    ASSERT_EQ(o[c], shown ? photo->data[bits == 24 ? p * 3 + c : p] : f[c]) << x << "," << y;
            }
    }
    PX small = px_random(717, 564, 24, 1), photo = px_random(10, 10, 24, 1);
    EXPECT_EQ(PXImage_Effect_Clip(photo.get(), small.get()), nullptr);
    // A photo without data or pixel rows shows nothing: a copy of the frame.
    uint8_t block[64] = {};
    for (const PXImage blank :
         {PXImage{700, 300, 24, nullptr}, PXImage{0, 300, 8, block}, PXImage{700, -3, 24, block}}) {
        PX out(PXImage_Effect_Clip(&blank, frame.get()));
        ASSERT_TRUE(out);
        EXPECT_EQ(bytes(out.get()), bytes(frame.get()));
    }
}

TEST(Paint, TwoToneFromTheStretchedGreenPlane) {
    PX rgb = px_random(13, 9, 24, 4);
    EXPECT_EQ(PXImage_Effect_Paint(rgb.get()), 0); // done, yet 0
    // Levels 20, 30, 40, 50 and 200..204: Otsu puts T at 50. Below T the grey worker spreads
    // lo = 20 .. hi = 40 and the blue one lo = 20 .. hi = 30 (level 20 counted twice).
    std::vector<uint8_t> plane(64);
    for (size_t i = 0; i < 64; ++i)
        plane[i] = uint8_t(i < 32 ? 20 + i % 4 * 10 : 200 + i % 5);
    auto grey = plane, blue = plane;
    ASSERT_EQ(EffectPaint_GrayRowData(grey.data(), 8, 8) + EffectPaint_BlueRowData(blue.data(), 8, 8), 2);
    for (size_t i = 0; i < 64; ++i) {
        const int v = plane[i];
        EXPECT_EQ(grey[i], v < 50 ? (v - 20) * 20 / 50 : int((v - 50) * 45.0 / 206 + 210.0)) << v;
        EXPECT_EQ(blue[i], v < 50 ? (v - 20) * 10 / 50 : int((v - 50) * 5.0 / 206 + 250.0)) << v;
    }
    std::vector<uint8_t> flat(16, 9);
    EXPECT_EQ(EffectPaint_GrayRowData(flat.data(), 4, 4) + EffectPaint_BlueRowData(flat.data(), 4, 4), 0);
    EXPECT_EQ(flat, std::vector<uint8_t>(16, 9));
}

} // namespace
