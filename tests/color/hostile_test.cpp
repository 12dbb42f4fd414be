// Hostile input for every colour function: the picture functions through the
// contract table, conversions and masks at their extremes.
#include <array>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

// Room for kernels up to 256 x 256, with weights that make the sums wrap.
const int32_t *big_kernel() {
    static const std::vector<int32_t> k = [] {
        std::vector<int32_t> v(256 * 256, 1);
        v[4] = INT_MIN, v[5] = INT_MAX, v[7] = -1;
        return v;
    }();
    return k.data();
}

int64_t split(C &c) {
    Image *p2 = nullptr, *p3 = nullptr, *alpha = nullptr;
    const int64_t r = Split(c.a, c.slot, &p2, &p3, &alpha, c.p);
    for (Image *p : {p2, p3, alpha})
        free_Image(&p, 0);
    return r;
}

} // namespace

TEST(Hostile, ColourPictures) {
    // Pixel readers take any bit count (unknown ones read as opaque black).
    const std::vector<int32_t> any = {8, 0, 1, 4, 12, 16, 24, 32, 48};
    static const int32_t k3[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    // A failed working allocation of Filter leaves the prepared result.
    const auto kernel_effect = [&](const char *name, int32_t (*fn)(const Image *, Image **)) {
        return Contract<Image>{.name = name,
                               .formats = any,
                               .call = [fn](C &c) { return int64_t(fn(c.a, c.slot)); },
                               .keeps_result_on_failure = true};
    };
    check_contracts<Image>({
        {.name = "Split", .formats = any, .call = split},
        {.name = "Combine",
         .formats = any,
         .call = [](C &c) { return (c.out = Combine(c.a, c.b, c.b, c.b, c.p)) != nullptr; },
         .pictures = 2,
         .slot = false,
         .mismatch_fails = true},
        {.name = "BaseTran_Hue",
         .formats = {8},
         .call = [](C &c) { return int64_t(BaseTran_Hue(c.a, c.p)); },
         .slot = false},
        {.name = "BaseTran_LS",
         .formats = {8},
         .call = [](C &c) { return int64_t(BaseTran_LS(c.a, c.p)); },
         .slot = false},
        {.name = "PX_IMG_Transform",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Transform(c.a, c.slot, c.p, c.p & 3)); }},
        {.name = "Filter in place",
         .formats = any,
         .call = [](C &c) { return int64_t(Filter(c.a, big_kernel(), c.p, c.p, c.p, nullptr, nullptr, c.p)); },
         .slot = false},
        // A null dst filters in place (the entry above).
        {.name = "Filter into dst",
         .formats = any,
         .call = [](C &c) { return c.b ? int64_t(Filter(c.a, k3, 3, c.p, c.p, nullptr, c.b, 1)) : 0; },
         .pictures = 2,
         .slot = false},
        kernel_effect("PX_IMG_Blur", PX_IMG_Blur),
        kernel_effect("PX_IMG_Soften", PX_IMG_Soften),
        kernel_effect("PX_IMG_Sharpen", PX_IMG_Sharpen),
        kernel_effect("PX_IMG_Emboss1", PX_IMG_Emboss1),
        {.name = "Filter_fast",
         .formats = {8, 12, 16, 24, 32, 48},
         .call = [](C &c) { return int64_t(Filter_fast(c.a, c.p, c.p)); },
         .slot = false},
        {.name = "PX_IMG_Smooth",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Smooth(c.a, c.slot, c.p)); },
         .slot = false,
         .typical = 50},
    });
}

TEST(Hostile, ConversionsAndMasks) {
    using Conv = uint32_t (*)(uint32_t);
    for (Conv fn : {RGBtoHSL, HSLtoRGB, RGBtoYUV, YUVtoRGB, RGBtoYIQ, YIQtoRGB, RGBtoXYZ, XYZtoRGB})
        for (uint32_t c : {0u, 0xFFFFFFFFu, 0x00FF00FFu, 0xFF00FF00u, 0x80FF0000u, 0x7F0000FFu})
            EXPECT_EQ(fn(c) >> 24, c >> 24) << std::hex << c; // alpha passes through
    for (uint16_t lo : {0, 255, 65535})
        for (uint16_t hi : {0, 255, 65535})
            for (uint16_t hue : {0, 42, 170, 255, 65535})
                (void)HueToRGB(lo, hi, hue);
    // A mask without pixels or with bad geometry is ignored.
    auto src = good<Image>(9, 7, 8, 41);
    static const int32_t k3[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    std::array<Image *, 2> want{};
    for (Image *&w : want)
        w = malloc_Image(9, 7, 8);
    ASSERT_EQ(Filter(&src->record, k3, 3, 16, 0, nullptr, want[0], 0), 1);
    for (auto &bad : broken<Image>({8})) {
        if (bad->what.rfind("bit count", 0) == 0) continue; // other bit counts select
        ASSERT_EQ(Filter(&src->record, k3, 3, 16, 0, &bad->record, want[1], 0), 1) << bad->what;
        EXPECT_EQ(std::memcmp(want[0]->bits, want[1]->bits, want[0]->pitch * 7), 0) << bad->what;
    }
    for (Image *&w : want)
        free_Image(&w, 0);
}
