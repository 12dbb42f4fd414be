// Channel shift through blended curve tables, against a per-pixel version.
#include <gtest/gtest.h>

#include "effect_check.hpp"

using namespace pxtest;

namespace {

// Curve value of mode `mode` for shift d at index i, low 8 bits (|d| small
// enough here that no sum leaves 32 bits).
int curve(uint32_t mode, int d, int i) {
    const int w = std::abs(d);
    const uint8_t *t = nullptr;
    switch (mode) {
    case 0: return i;
    case 1: t = ZANTOFILTERBK; break;
    case 2: t = ZANTOFILTER; break;
    case 3: return ZANTOFILTER[i];
    case 4: return ZANTOFILTERBK[i];
    case 5: t = d > 0 ? ZANTOFILTER : ZANTOFILTERBK; break;
    default: t = d < 0 ? ZANTOFILTER : ZANTOFILTERBK; break;
    }
    return ((127 - w) * i + w * t[i] + 63) / 127 & 255;
}

Owned ref_alter(const Image *src, int dR, int dG, int dB, uint32_t mode) {
    return per_pixel(src, [&](uint32_t c, int, int) {
        return rgba(curve(mode, dB, ltouc(chan(c, 0) + dB)), curve(mode, dG, ltouc(chan(c, 8) + dG)),
                    curve(mode, dR, ltouc(chan(c, 16) + dR)), chan(c, 24));
    });
}

} // namespace

TEST(Alter, EveryModeMatchesPerPixelCurves) {
    const int shifts[][3] = {{0, 0, 0}, {127, -127, 40}, {-5, 90, -60}, {200, -300, 128}};
    uint32_t seed = 1;
    for (uint32_t mode : {0u, 1u, 2u, 3u, 4u, 5u, 6u, 100u, 0xFFFFFFFFu})
        for (auto [dR, dG, dB] : shifts) {
            expect_like_reference([&](Image *s, Image **d) { return PX_IMG_Alter(s, d, dR, dG, dB, mode); },
                                  [&](const Image *s) { return ref_alter(s, dR, dG, dB, mode); }, seed);
            seed += 50;
        }
}

TEST(Alter, IdentityAndTableCases) {
    Owned src = random_image(7, 5, 32, 3);
    Slot dst;
    for (uint32_t mode : {0u, 1u, 2u, 5u, 9u}) { // zero shifts: identity curves
        ASSERT_EQ(PX_IMG_Alter(src.get(), &dst, 0, 0, 0, mode), 1u);
        EXPECT_EQ(diff(dst.get(), src.get()), "") << mode;
    }
    Owned px = filled(1, 1, 24, rgba(10, 20, 30, 255));
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, 0, 0, 0, 3), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(ZANTOFILTER[10], ZANTOFILTER[20], ZANTOFILTER[30], 255));
    // Mode 5 with +127 uses ZANTOFILTER outright at red + 127; the default mode ZANTOFILTERBK.
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, 127, 0, 0, 5), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(10, 20, ZANTOFILTER[157], 255));
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, 127, 0, 0, 6), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(10, 20, ZANTOFILTERBK[157], 255));
}

TEST(Alter, ExtremeShiftsWrapLikeThirtyTwoBitSums) {
    Owned px = filled(2, 1, 24, rgba(0, 0, 0, 255));
    SetPixelColor(px.get(), 1, 0, rgba(1, 1, 1, 255));
    Slot dst;
    // 0 + INT_MAX clamps to 255; 1 + INT_MAX wraps negative and clamps to 0.
    ASSERT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MAX, INT32_MAX, INT32_MAX, 0), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(255, 255, 255, 255));
    EXPECT_EQ(GetPixelColor(dst.get(), 1, 0), rgba(0, 0, 0, 255));
    for (uint32_t mode = 0; mode < 7; ++mode) {
        EXPECT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MIN, INT32_MAX, INT32_MIN + 1, mode), 1u);
        EXPECT_EQ(PX_IMG_Alter(px.get(), &dst, INT32_MAX, INT32_MIN, 0, mode), 1u);
    }
}

TEST(Alter, Refusals) {
    Owned src = random_image(3, 3, 24, 1);
    Slot dst;
    EXPECT_EQ(PX_IMG_Alter(src.get(), nullptr, 1, 2, 3, 1), 0u);
    EXPECT_EQ(PX_IMG_Alter(nullptr, &dst, 1, 2, 3, 1), 0u);
    EXPECT_EQ(dst.get(), nullptr);
}
