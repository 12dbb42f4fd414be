// Hue, saturation and lightness shifts: the plane maps, and the picture pass
// against the plane route (Split, shift one plane, Combine, copy).
#include <gtest/gtest.h>

#include <climits>

#include "support/test_images.hpp"

using namespace pxtest;

namespace {

Owned plane_route(const Image *src, const Image *existing, int amount, int component) {
    Slot h, s, l, a;
    EXPECT_EQ(Split(src, &h, &s, &l, &a, 1), 1);
    if (component == 0) BaseTran_Hue(h.get(), amount);
    if (component == 1 || component == 2) BaseTran_LS(component == 1 ? s.get() : l.get(), amount);
    Owned c(Combine(h.get(), s.get(), l.get(), a.get(), 1));
    if (existing == nullptr && c->bitCount == src->bitCount) return c;
    Owned out = existing ? clone(existing) : make(src->width, src->height, int32_t(src->bitCount));
    PX_Img_Copy(out.get(), c.get());
    return out;
}

} // namespace

TEST(BaseTran, HueWrapsBy255AndLevelsClamp) {
    // {hue (1) or level (0), value, amount, result}: 265 - 255; -1 + 255; step
    // -255 / 100 = -2; the low byte of 2302 + 1; ...
    const int cases[][4] = {{1, 10, 200, 10},         {1, 254, 0, 254},  {1, 3, 99, 1},
                            {1, 7, 1000, 255},        {1, 0, 0, 0},      {0, 100, INT32_MIN, 0},
                            {0, 100, INT32_MAX, 255}, {0, 100, 150, 227}};
    for (auto [hue, value, amount, want] : cases) {
        Owned p = make(2, 1, 8);
        p->bits[0] = uint8_t(value);
        ASSERT_EQ((hue ? BaseTran_Hue : BaseTran_LS)(p.get(), amount), 1);
        EXPECT_EQ(p->bits[0], want) << value << " " << amount;
        EXPECT_EQ(p->bits[2], 255); // only the first width bytes of a row
    }
    Owned rgb = random_image(3, 2, 24, 2), before = clone(rgb.get());
    EXPECT_EQ(BaseTran_LS(rgb.get(), 0) + BaseTran_Hue(rgb.get(), 0) + BaseTran_Hue(nullptr, 0), 0);
    EXPECT_EQ(diff(rgb.get(), before.get()), "");
}

TEST(Transform, EqualsThePlaneRoute) {
    uint32_t seed = 10;
    for (int32_t bc : kBitCounts)
        for (int component : {0, 1, 2, 5})
            for (int amount : {0, 37, 100, 163, 200}) {
                Owned src = random_image(7, 5, bc, seed++), want;
                // At 163 an existing image of another size and format is kept and filled.
                Owned other = amount == 163 ? random_image(5, 6, bc == 24 ? 32 : 24, seed) : nullptr;
                want = plane_route(src.get(), other.get(), amount, component);
                Slot out;
                Image *kept = out.image = other.release();
                ASSERT_EQ(PX_IMG_Transform(src.get(), &out, amount, component), 1);
                EXPECT_TRUE(kept == nullptr || out.get() == kept);
                ASSERT_EQ(diff(out.get(), want.get()), "") << bc << " c" << component << " a" << amount;
            }
    Owned src = random_image(6, 4, 32, 3);
    Slot out;
    Image hollow = *src, *hp = &hollow;
    hollow.bits = nullptr;
    EXPECT_EQ(PX_IMG_Transform(nullptr, &out, 100, 0) + PX_IMG_Transform(src.get(), nullptr, 100, 0) +
                  PX_IMG_Transform(&hollow, &out, 100, 0) + PX_IMG_Transform(src.get(), &hp, 100, 0),
              0);
    EXPECT_EQ(hp, &hollow);
}
