// Channel shift through blended curve tables.
#include <gtest/gtest.h>

#include "effect_check.hpp"

using namespace pxtest;

namespace {

// Curve of `mode` for shift d at index i, low 8 bits (|d| small enough here
// that no sum leaves 32 bits).
int curve(uint32_t mode, int d, int i) {
    const uint8_t *t = mode == 1 || mode == 4 ? ZANTOFILTERBK : ZANTOFILTER;
    if (mode == 0) return i;
    if (mode == 3 || mode == 4) return t[i];
    if (mode == 5) t = d > 0 ? ZANTOFILTER : ZANTOFILTERBK;
    if (mode > 5) t = d < 0 ? ZANTOFILTER : ZANTOFILTERBK;
    const int w = std::abs(d);
    return ((127 - w) * i + w * t[i] + 63) / 127 & 255;
}

} // namespace

TEST(Alter, EveryModeMatchesPerPixelCurves) {
    const int shifts[][3] = {{0, 0, 0}, {127, -127, 40}, {-5, 90, -60}, {200, -300, 128}};
    uint32_t seed = 1;
    for (uint32_t mode : {0u, 1u, 2u, 3u, 4u, 5u, 6u, 100u, 0xFFFFFFFFu})
        for (auto [dR, dG, dB] : shifts) {
            const auto at = [&](int d, uint32_t c, int sh) { return curve(mode, d, ltouc(chan(c, sh) + d)); };
            const auto ref = [&](const Image *s) {
                return per_pixel(s, [&](uint32_t c, int, int) {
                    return rgba(at(dB, c, 0), at(dG, c, 8), at(dR, c, 16), chan(c, 24));
                });
            };
            expect_like_reference([&](Image *s, Image **d) { return PX_IMG_Alter(s, d, dR, dG, dB, mode); }, ref,
                                  seed += 50);
        }
}

TEST(Alter, ExtremeShiftsWrapLikeThirtyTwoBitSums) {
    Owned px = filled(2, 1, 24, rgba(10, 20, 30, 255));
    SetPixelColor(px.get(), 1, 0, rgba(0, 0, 0, 255));
    Slot dst;
    // Sums wrap as 32-bit sums: 0 + INT_MAX clamps to 255, 10 + INT_MAX wraps negative to 0.
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MAX, INT32_MAX, INT32_MAX, 0), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(0, 0, 0, 255));
    EXPECT_EQ(GetPixelColor(dst.get(), 1, 0), rgba(255, 255, 255, 255));
    for (uint32_t mode = 0; mode < 7; ++mode)
        EXPECT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MIN, INT32_MAX, INT32_MIN + 1, mode), 1u);
    EXPECT_EQ(PX_IMG_Alter(px.get(), nullptr, 1, 2, 3, 1) + PX_IMG_Alter(nullptr, &dst, 1, 2, 3, 1), 0u);
}
