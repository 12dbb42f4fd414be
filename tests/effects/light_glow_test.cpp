// Channel scaling, contrast tables and the soft glow.
#include <gtest/gtest.h>

#include <cstring>

#include "effect_check.hpp"

using namespace pxtest;

namespace {

uint8_t ref_contrast(int contrast, int i) {
    const float f = static_cast<float>(contrast + 100) / 100.0f;
    const double v = static_cast<double>(static_cast<float>(i - 128) * f) + 128.0;
    return v >= 255 ? 255 : (v < 0 ? 0 : uint8_t(v));
}

auto ref_light(uint32_t percent, uint32_t channel) {
    return [=](const Image *src) {
        return per_pixel(src, [=](uint32_t c, int, int) {
            uint32_t out = c;
            for (uint32_t ch = 0; ch < 3; ++ch) {
                if (channel <= 2 && ch != channel) continue;
                const int shift = 16 - 8 * int(ch); // 0 red, 1 green, 2 blue
                const uint64_t v = std::min<uint64_t>(uint64_t(percent) * chan(c, shift) / 100, 255);
                out = (out & ~(255u << shift)) | uint32_t(v) << shift;
            }
            return out;
        });
    };
}

auto ref_ballance(int contrast) {
    return [=](const Image *src) {
        return per_pixel(src, [=](uint32_t c, int, int) {
            return rgba(ref_contrast(contrast, chan(c, 0)), ref_contrast(contrast, chan(c, 8)),
                        ref_contrast(contrast, chan(c, 16)), chan(c, 24));
        });
    };
}

} // namespace

TEST(LightAlter, MatchesPerPixelScaling) {
    const uint32_t cases[][2] = {{50, 0}, {150, 1}, {37, 2}, {250, 3}, {1, 0xFFFFFFFFu}, {0xFFFFFFFFu, 4}};
    uint32_t seed = 1;
    for (auto [percent, channel] : cases) {
        expect_like_reference([=](Image *s, Image **d) { return PX_IMG_Light_Alter(s, d, percent, channel); },
                              ref_light(percent, channel), seed);
        seed += 100;
    }
}

TEST(LightAlter, CopyAndClearPercentages) {
    Owned src = filled(3, 2, 32, rgba(10, 200, 30, 77));
    Slot dst;
    ASSERT_EQ(PX_IMG_Light_Alter(src.get(), &dst, 200, 1), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(10, 255, 30, 77));
    for (uint32_t channel : {0u, 2u, 9u}) {
        ASSERT_EQ(PX_IMG_Light_Alter(src.get(), &dst, 100, channel), 1u);
        EXPECT_EQ(diff(dst.get(), src.get()), "");
    }
    ASSERT_EQ(PX_IMG_Light_Alter(src.get(), &dst, 0, 1), 1u);
    for (uint32_t i = 0; i < dst->pitch * 2; ++i)
        ASSERT_EQ(dst->bits[i], 0) << i; // alpha and padding too
    EXPECT_EQ(PX_IMG_Light_Alter(nullptr, &dst, 50, 1), 0u);
    EXPECT_EQ(PX_IMG_Light_Alter(src.get(), nullptr, 50, 1), 0u);
}

TEST(Ballance, TableValuesAndPerPixelPass) {
    EXPECT_EQ(ref_contrast(5, 0), 0);
    EXPECT_EQ(ref_contrast(5, 255), 255);
    EXPECT_EQ(ref_contrast(5, 128), 128);
    EXPECT_EQ(ref_contrast(5, 188), 190); // 60 * 1.05f = 62.9999962, summed in double
    EXPECT_EQ(ref_contrast(5, 100), 98);  // -28 * 1.05f + 128 = 98.6
    expect_like_reference([](Image *s, Image **d) { return PX_IMG_Ballance(s, d, 5); }, ref_ballance(5), 1);
    expect_like_reference([](Image *s, Image **d) { return PX_IMG_Ballance(s, d, -30); }, ref_ballance(-30), 100);
    Owned src = random_image(9, 4, 24, 5);
    Slot dst;
    ASSERT_EQ(PX_IMG_Ballance(src.get(), &dst, -100), 1u); // every entry 128
    EXPECT_EQ(GetPixelColor(dst.get(), 3, 2), rgba(128, 128, 128, 255));
    // Extreme contrasts: contrast + 100 is formed without overflow.
    Owned ramp = filled(1, 1, 24, rgba(0, 128, 255, 255));
    ASSERT_EQ(PX_IMG_Ballance(ramp.get(), &dst, INT32_MAX), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(0, 128, 255, 255));
    ASSERT_EQ(PX_IMG_Ballance(ramp.get(), &dst, INT32_MIN), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), rgba(255, 128, 0, 255));
}

TEST(Ballance, ZeroContrastCopiesTheBlockBytes) {
    Owned src = random_image(5, 3, 24, 8);
    Slot dst;
    ASSERT_EQ(PX_IMG_Ballance(src.get(), &dst, 0), 1u);
    EXPECT_EQ(std::memcmp(dst->bits, src->bits, src->pitch * 3), 0); // padding included
    EXPECT_EQ(PX_IMG_Ballance(nullptr, &dst, 0), 0u);
}
