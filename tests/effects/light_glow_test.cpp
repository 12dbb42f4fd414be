// Channel scaling, the contrast table and the soft glow.
#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <vector>

#include "effect_check.hpp"

using namespace pxtest;

TEST(LightAndContrast, HandComputedPixelsInEveryFormat) {
    using Run = std::function<uint32_t(Image *, Image **)>;
    const auto light = [](uint32_t p, uint32_t ch) {
        return Run([=](Image *s, Image **d) { return PX_IMG_Light_Alter(s, d, p, ch); });
    };
    const auto contrast = [](int32_t c) { return Run([=](Image *s, Image **d) { return PX_IMG_Ballance(s, d, c); }); };
    const uint32_t in = rgba(10, 200, 30, 77);
    const struct {
        Run effect;
        uint32_t in, out;
    } cases[] = {
        {light(50, 0), in, rgba(10, 200, 15, 77)},
        {light(200, 1), in, rgba(10, 255, 30, 77)},
        {light(37, 2), in, rgba(3, 200, 30, 77)},
        {light(150, 7), in, rgba(15, 255, 45, 77)},
        {light(100, 2), in, in},
        {light(0xFFFFFFFFu, 1), in, rgba(10, 255, 30, 77)}, // no wrap
        {contrast(5), rgba(0, 255, 128, 1), rgba(0, 255, 128, 1)},
        {contrast(5), rgba(188, 100, 228, 1), rgba(190, 98, 232, 1)}, // 60 * 1.05f = 62.9999962, + 128.0 in double
        {contrast(-100), rgba(3, 200, 255, 1), rgba(128, 128, 128, 1)},
        {contrast(INT32_MAX), rgba(0, 128, 255, 1), rgba(0, 128, 255, 1)}, // contrast + 100 does not overflow
        {contrast(INT32_MIN), rgba(0, 128, 255, 1), rgba(255, 128, 0, 1)},
    };
    for (const auto &c : cases) {
        expect_pixel(c.effect, c.in, c.out);
        expect_format_consistent(c.effect, c.out);
    }
}

TEST(LightAndContrast, BlockCopiesAndClears) {
    Owned src = random_image(5, 3, 24, 8);
    Slot dst;
    ASSERT_EQ(PX_IMG_Ballance(src.get(), &dst, 0), 1u); // block bytes, padding included
    EXPECT_EQ(std::memcmp(dst->bits, src->bits, src->pitch * 3), 0);
    ASSERT_EQ(PX_IMG_Light_Alter(src.get(), &dst, 0, 1), 1u); // every byte cleared
    EXPECT_EQ(std::vector<uint8_t>(dst->bits, dst->bits + dst->pitch * 3), std::vector<uint8_t>(dst->pitch * 3));
    EXPECT_EQ(PX_IMG_Ballance(nullptr, &dst, 0) + PX_IMG_Light_Alter(nullptr, &dst, 50, 1), 0u);
}

// The glow as the chain of whole images: blur, halve, raise contrast, then a
// screen blend written pixel by pixel.
static Owned ref_lambency(const Image *src) {
    const int32_t k[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    Owned t1 = make(src->width, src->height, static_cast<int32_t>(src->bitCount));
    Filter(const_cast<Image *>(src), k, 3, 16, 0, nullptr, t1.get(), 0);
    Slot t2, t3;
    PX_IMG_Light_Alter(t1.get(), &t2, 50, 4);
    PX_IMG_Ballance(t2.get(), &t3, 5);
    return per_pixel(src, [&](uint32_t a, int x, int y) {
        const uint32_t b = GetPixelColor(t3.get(), x, y);
        for (int s : {0, 8, 16}) {
            const int v = std::min(chan(a, s) + chan(b, s) - ((chan(a, s) * chan(b, s)) >> 8), 255);
            a = (a & ~(255u << s)) | uint32_t(v) << s;
        }
        return a;
    });
}

TEST(Lambency, MatchesTheImageChain) {
    expect_like_reference(PX_IMG_Lambency, ref_lambency, 1);
    // A hand-made 4-bit record: the working image and a new result are 8-bit.
    std::vector<uint8_t> nibbles(4 * 5);
    for (size_t i = 0; i < nibbles.size(); ++i)
        nibbles[i] = uint8_t(i * 37 + 11);
    Image packed{7, 5, 4, nibbles.data(), 4, 0};
    Slot dst;
    ASSERT_EQ(PX_IMG_Lambency(&packed, &dst), 1u);
    EXPECT_EQ(diff(dst.get(), ref_lambency(&packed).get()), "");
    EXPECT_EQ(PX_IMG_Lambency(&packed, nullptr) + PX_IMG_Lambency(nullptr, &dst), 0u);
}
