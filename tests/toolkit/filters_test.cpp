// Sharpening, smoothing, edges, binarisation, the sort and the two effects
// against brute-force versions on awkward sizes of every supported format.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>

#include "toolkit/px_images.hpp"

using namespace pxtest;

namespace {

const int kSizes[][2] = {{1, 1}, {1, 9}, {9, 1}, {2, 3}, {8, 8}, {13, 7}, {6, 60}};

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
    int s = 0;
    for (size_t i = 0; i < win.size(); ++i)
        s += k[i] * win[i];
    return s;
}

TEST(Sharpen, KernelChosenByStrengthWithLateStartForTheLargest) {
    for (int bits : {8, 16, 24})
        for (const auto &sz : kSizes)
            for (int strength : {-3, 39, 40, 79, 80, 100}) {
                PX src = px_random(sz[0], sz[1], bits, uint32_t(sz[0] * 31 + strength));
                const auto k = sharpen_kernel(strength);
                const int size = int(std::sqrt(double(k.size())));
                PX want = brute(src.get(), size, size == 7 ? 49 : 0,
                                [&](const std::vector<int> &w) { return limit(src.get(), weighted(w, k)); });
                ASSERT_EQ(PXImage_Sharpen(src.get(), strength), 1);
                EXPECT_EQ(bytes(src.get()), bytes(want.get()))
                    << bits << " bits " << sz[0] << "x" << sz[1] << " strength " << strength;
            }
    PX img = px_random(5, 5, 8, 1), orig = px_clone(img.get());
    EXPECT_EQ(PXImage_Sharpen(img.get(), 0), 0);
    EXPECT_EQ(PXImage_Sharpen(img.get(), 101), 1);
    EXPECT_EQ(PXImage_Sharpen(img.get(), INT32_MAX), 1);
    EXPECT_EQ(bytes(img.get()), bytes(orig.get()));
    PX rgba = px_random(5, 5, 32, 1);
    EXPECT_EQ(PXImage_Sharpen(rgba.get(), 50), 1);
}

TEST(Smooth, MeanAndMedianMatchSortedWindows) {
    for (int bits : {8, 16, 24})
        for (const auto &sz : kSizes)
            for (int strength : {-1, 19, 20, 40, 60, 79, 80, 1000}) {
                PX src = px_random(sz[0], sz[1], bits, uint32_t(sz[1] * 17 + strength));
                const int size = strength < 20 ? 3 : strength < 40 ? 5 : strength < 60 ? 7 : strength < 80 ? 5 : 7;
                PX want = brute(src.get(), size, 0, [&](std::vector<int> w) {
                    if (strength < 60) return weighted(w, std::vector<int>(w.size(), 1)) / int(w.size());
                    std::sort(w.begin(), w.end());
                    return w[w.size() / 2];
                });
                ASSERT_EQ(PXImage_Smooth(src.get(), strength), 1);
                EXPECT_EQ(bytes(src.get()), bytes(want.get()))
                    << bits << " bits " << sz[0] << "x" << sz[1] << " strength " << strength;
            }
    PX dot = px_make(9, 9, 8, 10);
    dot->data[40] = 250;
    ASSERT_EQ(PXImage_Smooth(dot.get(), 70), 1);
    EXPECT_EQ(bytes(dot.get()), std::vector<uint8_t>(81, 10));
    EXPECT_EQ(PXImage_Smooth(dot.get(), 0), 0);
}

TEST(Sort, PartitionExchangeOnAdversarialInputs) {
    const int n = 4000;
    std::vector<std::vector<int32_t>> inputs(5, std::vector<int32_t>(n));
    std::mt19937 rng(5);
    for (int i = 0; i < n; ++i) {
        inputs[0][i] = i;                                     // sorted
        inputs[1][i] = n - i;                                 // reversed
        inputs[2][i] = 7;                                     // equal
        inputs[3][i] = int32_t(rng());                        // random, both signs
        inputs[4][i] = i % 2 ? INT32_MIN + i : INT32_MAX - i; // organ pipe of extremes
    }
    for (auto v : inputs) {
        auto want = v;
        std::sort(want.begin(), want.end());
        px_ShellSort(v.data(), 0, n - 1);
        EXPECT_EQ(v, want);
    }
    std::vector<int32_t> part = {5, 4, 3, 2, 1, 0};
    px_ShellSort(part.data(), 1, 4);
    EXPECT_EQ(part, (std::vector<int32_t>{5, 1, 2, 3, 4, 0}));
    px_ShellSort(nullptr, 0, 5);
}

TEST(Edges, LopsidedKernelShiftedByTwo) {
    const std::vector<int> k = {1, 0, -1, 2, 0, -2, 1, 1, -1};
    for (int bits : {8, 16, 24})
        for (const auto &sz : kSizes) {
            PX src = px_random(sz[0], sz[1], bits, uint32_t(bits + sz[0]));
            PX want = brute(src.get(), 3, 0,
                            [&](const std::vector<int> &w) { return limit(src.get(), weighted(w, k) >> 2); });
            ASSERT_EQ(PXImage_EdgeDetection(src.get()), 1);
            EXPECT_EQ(bytes(src.get()), bytes(want.get())) << bits << " bits " << sz[0] << "x" << sz[1];
        }
    EXPECT_EQ(PXImage_EdgeDetection(nullptr), 0);
}

TEST(Binarize, OtsuThresholdPerFormat) {
    PX twoLevel = px_random(8, 8, 8, 3);
    for (size_t i = 0; i < 64; ++i)
        twoLevel->data[i] = twoLevel->data[i] & 1 ? 255 : 0;
    PX before = px_clone(twoLevel.get());
    ASSERT_EQ(PXImage_GrayToBinarization(twoLevel.get()), 1);
    EXPECT_EQ(bytes(twoLevel.get()), bytes(before.get()));

    for (int bits : {8, 16, 24}) {
        PX img = px_random(11, 7, bits, 12);
        const size_t n = 77;
        std::vector<uint8_t> plane(n);
        for (size_t i = 0; i < n; ++i)
            plane[i] = uint8_t(bits == 8    ? img->data[i]
                               : bits == 24 ? img->data[3 * i + 1]
                                            : ((img->data[2 * i] | img->data[2 * i + 1] << 8) & 0x7E0) >> 3);
        const int t = ProbabilityDensityValue(plane.data(), 11, 7);
        PX want = px_clone(img.get());
        for (size_t i = 0; i < n; ++i)
            for (int c = 0; c < (bits == 24 ? 3 : 1); ++c)
                put_sample(want.get(), int(i / 11), int(i % 11), c, plane[i] > t ? (bits == 16 ? 65535 : 255) : 0);
        ASSERT_EQ(PXImage_GrayToBinarization(img.get()), 1);
        EXPECT_EQ(bytes(img.get()), bytes(want.get())) << bits;
    }
    PX rgba = px_random(3, 3, 32, 1);
    EXPECT_EQ(PXImage_GrayToBinarization(rgba.get()), 0);
}

TEST(Clip, PhotoShowsThroughDarkHolesInsideTheWindow) {
    PX frame = px_random(720, 566, 24, 4);
    for (size_t i = 2; i < px_size(frame.get()); i += 3)
        if (frame->data[i] < 40) frame->data[i] = uint8_t(frame->data[i] % 7); // some holes
    for (int bits : {8, 24}) {
        PX photo = px_random(700, 300, bits, 6); // shorter than the window
        PX out(PXImage_Effect_Clip(photo.get(), frame.get()));
        ASSERT_TRUE(out);
        const int pb = bits / 8;
        for (int y = 0; y < 566; ++y)
            for (int x = 0; x < 720; ++x) {
                const uint8_t *f = frame->data + (y * 720 + x) * 3, *o = out->data + (y * 720 + x) * 3;
                const size_t p = size_t(y - 50) * 700 + (x - 40);
                const bool shown = y >= 50 && y < 564 && x >= 40 && x < 718 && f[2] < 7 && p < 700 * 300;
                for (int c = 0; c < 3; ++c)
                    ASSERT_EQ(o[c], shown ? photo->data[p * pb + (pb == 3 ? c : 0)] : f[c]) << x << "," << y;
            }
    }
    PX small = px_random(717, 564, 24, 1), photo = px_random(10, 10, 24, 1);
    EXPECT_EQ(PXImage_Effect_Clip(photo.get(), small.get()), nullptr);
    EXPECT_EQ(PXImage_Effect_Clip(photo.get(), nullptr), nullptr);
    EXPECT_EQ(PXImage_Effect_Clip(nullptr, frame.get()), nullptr);
}

// Literal grey and blue stretch workers.
int ref_stretch(std::vector<uint8_t> &p, int w, int h, bool blue) {
    std::vector<int> H(256);
    for (uint8_t v : p)
        ++H[v];
    const int T = ProbabilityDensityValue(p.data(), w, h);
    int S = 0;
    for (int i = 0; i < T; ++i)
        S += H[i];
    if (S == 0) return 0;
    int lo = -1, hi = -1;
    if (!blue) {
        for (int i = 0; i < T && lo < 0; ++i)
            if (double(H[i]) / S > 0.01) lo = i;
        lo = std::max(lo, 0);
        for (int i = T - 1; i > lo && hi < 0; --i)
            if (double(H[i]) / S > 0.01) hi = i;
        if (hi < 0) return 0;
    } else {
        int cum = 0;
        for (int i = 0; i < T && lo < 0; ++i)
            if ((cum += H[i]) > 0.01 * S) lo = i;
        if (lo < 0) return 0;
        for (int i = lo; i < T && hi < 0; ++i)
            if ((cum += H[i]) > 0.98 * S) hi = i;
        if (hi <= lo) return 0;
    }
    const double base = blue ? 250.0 : 210.0, span = blue ? 5.0 : 45.0;
    int table[256];
    for (int j = 0; j < T; ++j)
        table[j] = std::clamp(int(double((j - lo) * (hi - lo)) / T), 0, 255);
    for (int k = 0; k <= 255 - T; ++k)
        table[T + k] = std::clamp(int(k * span / (256 - T) + base), 0, 255);
    for (uint8_t &v : p)
        v = uint8_t(table[v]);
    return 1;
}

TEST(Paint, StretchCurvesAndTwoToneResult) {
    for (uint32_t seed = 1; seed <= 8; ++seed)
        for (bool blue : {false, true}) {
            PX img = px_random(13, 9, 8, seed);
            for (size_t i = 0; i < 117; ++i) // a dark cluster and a spread of brighter levels
                img->data[i] = uint8_t(i % 3 ? 20 + img->data[i] % (10 * seed) : img->data[i]);
            std::vector<uint8_t> want = bytes(img.get());
            const int r = ref_stretch(want, 13, 9, blue);
            EXPECT_EQ(blue ? EffectPaint_BlueRowData(img->data, 13, 9) : EffectPaint_GrayRowData(img->data, 13, 9), r);
            EXPECT_EQ(bytes(img.get()), want) << seed << (blue ? " blue" : " grey");
        }
    PX rgb = px_random(13, 9, 24, 4);
    std::vector<uint8_t> g(117);
    for (size_t i = 0; i < 117; ++i)
        g[i] = rgb->data[3 * i + 1];
    ref_stretch(g, 13, 9, false);
    EXPECT_EQ(PXImage_Effect_Paint(rgb.get()), 0);
    for (size_t i = 0; i < 117; ++i) {
        const int v = g[i];
        EXPECT_EQ(rgb->data[3 * i], v ? v - 1 : 0);
        EXPECT_EQ(rgb->data[3 * i + 1], v);
        EXPECT_EQ(rgb->data[3 * i + 2], std::min(255, v + (v >= 60 && v <= 128 ? 18 : 2)));
    }
    uint8_t one = 5;
    EXPECT_EQ(EffectPaint_GrayRowData(&one, 0, 1), 0);
    EXPECT_EQ(EffectPaint_BlueRowData(nullptr, 1, 1), 0);
}

} // namespace
