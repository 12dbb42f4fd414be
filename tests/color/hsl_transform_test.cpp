// Hue, saturation and lightness shifts: the plane maps, and the picture pass
// against the plane route (Split, shift one plane, Combine, copy).
#include <gtest/gtest.h>

#include <climits>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

int shifted(int32_t (*fn)(Image *, int32_t), int value, int amount) {
    Owned p = make(1, 1, 8);
    p->bits[0] = uint8_t(value);
    EXPECT_EQ(fn(p.get(), amount), 1);
    return p->bits[0];
}

// The picture pass done with the exported plane operations.
Owned plane_route(const Image *src, Image *existing, int amount, int component) {
    Slot h, s, l, a;
    EXPECT_EQ(Split(src, &h, &s, &l, &a, 1), 1);
    if (component == 0) BaseTran_Hue(h.get(), amount);
    if (component == 1) BaseTran_LS(s.get(), amount);
    if (component == 2) BaseTran_LS(l.get(), amount);
    Owned c(Combine(h.get(), s.get(), l.get(), a.get(), 1));
    if (existing == nullptr && c->bitCount == src->bitCount) return c;
    Owned out = existing ? clone(existing) : make(src->width, src->height, int32_t(src->bitCount));
    PX_Img_Copy(out.get(), c.get());
    return out;
}

} // namespace

TEST(BaseTran, HueWrapsBy255AndLevelsClamp) {
    EXPECT_EQ(shifted(BaseTran_Hue, 10, 200), 10);   // 265 wraps to 10
    EXPECT_EQ(shifted(BaseTran_Hue, 0, 0), 0);       // -255 wraps to 0
    EXPECT_EQ(shifted(BaseTran_Hue, 254, 0), 254);   // -1 wraps to 254
    EXPECT_EQ(shifted(BaseTran_Hue, 255, 101), 2);   // 257 - 255
    EXPECT_EQ(shifted(BaseTran_Hue, 100, 150), 227); // step 127
    EXPECT_EQ(shifted(BaseTran_Hue, 100, 50), 228);  // -27 + 255
    EXPECT_EQ(shifted(BaseTran_Hue, 3, 99), 1);      // step -255 / 100 = -2
    EXPECT_EQ(shifted(BaseTran_Hue, 7, 1000), 255);  // step 2295: 2302 + 1, low byte
    EXPECT_EQ(shifted(BaseTran_LS, 100, 0), 0);
    EXPECT_EQ(shifted(BaseTran_LS, 100, 200), 255);
    EXPECT_EQ(shifted(BaseTran_LS, 100, 150), 227);
    EXPECT_EQ(shifted(BaseTran_LS, 100, 99), 98);
    EXPECT_EQ(shifted(BaseTran_LS, 100, INT32_MIN), 0);
    EXPECT_EQ(shifted(BaseTran_LS, 100, INT32_MAX), 255);
    // Only the first width bytes of each row are touched.
    Owned p = random_image(3, 2, 8, 1);
    const uint8_t pad = p->bits[3];
    ASSERT_EQ(BaseTran_LS(p.get(), 200), 1);
    EXPECT_EQ(p->bits[0], 255);
    EXPECT_EQ(p->bits[3], pad);
    Owned rgb = random_image(3, 2, 24, 2), before = clone(rgb.get());
    EXPECT_EQ(BaseTran_LS(rgb.get(), 0), 0);
    EXPECT_EQ(BaseTran_Hue(rgb.get(), 0), 0);
    EXPECT_EQ(BaseTran_Hue(nullptr, 0), 0);
    EXPECT_EQ(diff(rgb.get(), before.get()), "");
}

TEST(Transform, EqualsThePlaneRoute) {
    uint32_t seed = 10;
    for (int32_t bc : kBitCounts)
        for (int component : {0, 1, 2, 5})
            for (int amount : {0, 37, 100, 163, 200}) {
                Owned src = random_image(7, 5, bc, seed++);
                Slot out;
                ASSERT_EQ(PX_IMG_Transform(src.get(), &out, amount, component), 1);
                Owned want = plane_route(src.get(), nullptr, amount, component);
                ASSERT_EQ(diff(out.get(), want.get()), "") << bc << " c" << component << " a" << amount;
                // An existing image of another size and format is kept and filled.
                Owned other = random_image(4, 6, bc == 32 ? 24 : 32, seed++);
                Owned wantOther = plane_route(src.get(), other.get(), amount, component);
                Image *kept = out.image = other.release();
                ASSERT_EQ(PX_IMG_Transform(src.get(), &out, amount, component), 1);
                EXPECT_EQ(out.get(), kept);
                ASSERT_EQ(diff(out.get(), wantOther.get()), "") << bc << " into existing";
            }
}

TEST(Transform, NeutralAmountIsOneRoundTripAndRefusals) {
    Owned src = random_image(6, 4, 32, 3);
    Slot out;
    ASSERT_EQ(PX_IMG_Transform(src.get(), &out, 100, 1), 1);
    EXPECT_EQ(out->bitCount, 32u);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 6; ++x)
            ASSERT_EQ(GetPixelColor(out.get(), x, y), HSLtoRGB(RGBtoHSL(GetPixelColor(src.get(), x, y))));
    Image hollow = *src;
    hollow.bits = nullptr;
    Image *hp = &hollow;
    EXPECT_EQ(PX_IMG_Transform(nullptr, &out, 100, 0), 0);
    EXPECT_EQ(PX_IMG_Transform(src.get(), nullptr, 100, 0), 0);
    EXPECT_EQ(PX_IMG_Transform(&hollow, &out, 100, 0), 0);
    EXPECT_EQ(PX_IMG_Transform(src.get(), &hp, 100, 0), 0);
    EXPECT_EQ(hp, &hollow);
}
