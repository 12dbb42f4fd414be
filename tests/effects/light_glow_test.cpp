// Channel scaling, contrast tables and the soft glow.
#include <gtest/gtest.h>

#include <cstring>
#include <vector>

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

namespace {

// The glow as a chain of whole images: blur, halve, raise contrast, then a
// screen blend written pixel by pixel.
Owned ref_lambency(const Image *src) {
    const int32_t k[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    Owned t1 = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    Filter(const_cast<Image *>(src), k, 3, 16, 0, nullptr, t1.get(), 0);
    Slot t2, t3;
    PX_IMG_Light_Alter(t1.get(), &t2, 50, 4);
    PX_IMG_Ballance(t2.get(), &t3, 5);
    return per_pixel(src, [&](uint32_t a, int x, int y) {
        const uint32_t b = GetPixelColor(t3.get(), x, y);
        uint32_t out = a & 0xFF000000u;
        for (int s : {0, 8, 16})
            out |= uint32_t(std::min(chan(a, s) + chan(b, s) - ((chan(a, s) * chan(b, s)) >> 8), 255)) << s;
        return out;
    });
}

} // namespace

TEST(Lambency, MatchesTheImageChain) {
    expect_like_reference(PX_IMG_Lambency, ref_lambency, 1);
    // A hand-made 4-bit record: the working images and a new result are 8-bit.
    std::vector<uint8_t> nibbles(4 * 5);
    for (size_t i = 0; i < nibbles.size(); ++i)
        nibbles[i] = uint8_t(i * 37 + 11);
    Image packed{7, 5, 4, nibbles.data(), 4, 0};
    Slot dst;
    ASSERT_EQ(PX_IMG_Lambency(&packed, &dst), 1u);
    Owned expect = ref_lambency(&packed);
    EXPECT_EQ(dst->bitCount, 8u);
    EXPECT_EQ(diff(dst.get(), expect.get()), "");
}

TEST(Lambency, BlackStaysBlackAndWhiteStaysWhite) {
    Slot dst;
    for (int32_t bc : {24, 32}) {
        Owned black = filled(6, 5, bc, 0x80000000u), white = filled(6, 5, bc, 0xFFFFFFFFu);
        ASSERT_EQ(PX_IMG_Lambency(black.get(), &dst), 1u);
        EXPECT_EQ(diff(dst.get(), black.get()), "");
        ASSERT_EQ(PX_IMG_Lambency(white.get(), &dst), 1u);
        EXPECT_EQ(diff(dst.get(), white.get()), "");
    }
    Owned src = random_image(4, 4, 24, 2);
    EXPECT_EQ(PX_IMG_Lambency(src.get(), nullptr), 0u);
    EXPECT_EQ(PX_IMG_Lambency(nullptr, &dst), 0u);
}
