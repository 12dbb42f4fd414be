// Hostile input for every effect: the picture functions through the contract
// table, the byte-plane kernel sum at its extremes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

TEST(Hostile, Effects) {
    // Effects read through the pixel readers, so any bit count works (unknown
    // ones read as opaque black).
    const std::vector<int32_t> any = {8, 0, 1, 4, 12, 16, 24, 32, 48};
    using Effect = uint32_t (*)(Image *, Image **);
    const auto plain = [&](const char *name, Effect fn, bool keeps = false) {
        return Contract<Image>{.name = name,
                               .formats = any,
                               .call = [fn](C &c) { return int64_t(fn(c.a, c.slot)); },
                               .keeps_result_on_failure = keeps};
    };
    check_contracts<Image>({
        {.name = "PX_ProcessImage",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_ProcessImage(c.a, c.slot, uint32_t(c.p))); },
         .keeps_result_on_failure = true},
        plain("PX_IMG_Neon", PX_IMG_Neon),
        plain("PX_IMG_Emboss", PX_IMG_Emboss),
        plain("PX_IMG_Photocopy", PX_IMG_Photocopy),
        {.name = "PX_IMG_Sketch",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Sketch(c.a, c.slot)); },
         .keeps_result_on_failure = true},
        plain("PX_IMG_Sketch_1", PX_IMG_Sketch_1, true),
        plain("PX_IMG_Negative", PX_IMG_Negative),
        plain("PX_IMG_WARM_YELLOW", PX_IMG_WARM_YELLOW),
        plain("PX_IMG_COLD_PUPRLE", PX_IMG_COLD_PUPRLE),
        plain("PX_IMG_Classical_Photograph", PX_IMG_Classical_Photograph),
        plain("PX_IMG_Repristination", PX_IMG_Repristination),
        plain("PX_IMG_Line", PX_IMG_Line),
        plain("my", my),
        plain("PX_IMG_Lambency", PX_IMG_Lambency),
        {.name = "PX_IMG_Light_Alter",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Light_Alter(c.a, c.slot, uint32_t(c.p), uint32_t(c.p))); }},
        {.name = "PX_IMG_Ballance",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Ballance(c.a, c.slot, c.p)); }},
        {.name = "PX_IMG_Mosaic",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Mosaic(c.a, c.slot, c.p)); }},
        {.name = "PX_IMG_Aquarelle",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Aquarelle(c.a, c.slot, c.p)); }},
        {.name = "imOil",
         .formats = any,
         .call = [](C &c) { return int64_t(imOil(c.a, c.slot, c.p)); },
         .keeps_result_on_failure = true,
         .typical = 1},
        {.name = "imOil_1", .formats = {24, 32}, .call = [](C &c) { return int64_t(imOil_1(c.a, c.slot)); }},
        {.name = "ColorCompress",
         .formats = {8},
         .call = [](C &c) { return int64_t(ColorCompress(c.a, c.p)); },
         .slot = false},
        {.name = "PX_IMG_Alter",
         .formats = any,
         .call = [](C &c) { return int64_t(PX_IMG_Alter(c.a, c.slot, c.p, ~c.p, c.p, uint32_t(c.p))); }},
    });
}

TEST(Hostile, KernelSumOfABytePlane) {
    const uint8_t plane[4 * 3 + 1] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13};
    const int32_t k[9] = {INT_MIN, INT_MAX, -1, 1, 1, 1, 1, 1, 1};
    EXPECT_EQ(temp_ex(nullptr, 4, 3, k, 3, 1, 1) + temp_ex(plane, 4, 3, nullptr, 3, 1, 1), 0);
    for (int32_t v : kExtremes) {
        if (v <= 0) { // width 0 still reads its column 0
            EXPECT_EQ(temp_ex(plane, v - (v == 0), 3, k, 3, 1, 1) + temp_ex(plane, 4, v, k, 3, 1, 1), 0) << v;
            EXPECT_EQ(temp_ex(plane, 4, 3, k, v, 1, 1), 0) << v;
        }
        if (v < -1 || v > 4) {
            EXPECT_EQ(temp_ex(plane, 4, 3, k, 3, v, 1), 0) << v; // every tap off the plane
            EXPECT_EQ(temp_ex(plane, 4, 3, k, 3, 1, v), 0) << v;
        }
    }
}
