// Neon, emboss and the dispatcher against straightforward accessor versions,
// plus the result-image rule.
#include <gtest/gtest.h>

#include <cstdlib>

#include "effect_check.hpp"

using namespace pxtest;

namespace {

// The last row and column are not written: a new result keeps them white.
Owned reference_neon(const Image *s) {
    return per_pixel(s, [&](uint32_t c, int x, int y) {
        if (x == s->width - 1 || y == s->height - 1) return 0xFFFFFFFFu;
        const uint32_t r = GetPixelColor(s, x + 1, y), d = GetPixelColor(s, x, y + 1);
        uint32_t o = c & 0xFF000000u;
        for (int sh : {0, 8, 16}) {
            const int dx = chan(c, sh) - chan(r, sh), dy = chan(c, sh) - chan(d, sh);
            o |= uint32_t(ltouc(int32_t(2 * xxgluSqrtFx(uint32_t(dx * dx + dy * dy))))) << sh;
        }
        return o;
    });
}

// Border: x < 2, y < 2, x == w - 2 or y == h - 2 (not the last row or column).
Owned reference_emboss(const Image *s) {
    return per_pixel(s, [&](uint32_t c, int x, int y) {
        int v = chan(c, 8);
        if (x >= 2 && y >= 2 && x != s->width - 2 && y != s->height - 2) {
            const uint32_t a = GetPixelColor(s, x - 2, y - 2), b = GetPixelColor(s, x + 2, y + 2);
            int hi = -999, lo = 999;
            for (int sh : {0, 8, 16})
                hi = std::max(hi, chan(a, sh) - chan(b, sh)), lo = std::min(lo, chan(a, sh) - chan(b, sh));
            const int e = 2 * (std::abs(lo) < std::abs(hi) ? hi : lo);
            v = e > 128 ? 255 : (e <= -128 ? 0 : e + 127);
        }
        return rgba(v, v, v, 255);
    });
}

} // namespace

// Through the dispatcher: 0 neon, 1 emboss (2 photocopy and 3 sketch beside their references).
TEST(NeonEmboss, MatchAccessorVersionsOnEveryFormat) {
    expect_like_reference([](Image *s, Image **d) { return PX_ProcessImage(s, d, 0); }, reference_neon, 1);
    expect_like_reference([](Image *s, Image **d) { return PX_ProcessImage(s, d, 1); }, reference_emboss, 100);
}

TEST(NeonEmboss, ResultRuleReuseAndReplace) {
    Owned src = random_image(6, 4, 32, 9);
    Slot dst, other;
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    Image *first = dst.get(); // a fitting result is reused as it stands
    SetPixelColor(first, 5, 3, 0x01020304);
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 5, 3), 0x01020304u);
    other.image = malloc_Image(6, 4, 24); // another bit count is replaced
    ASSERT_EQ(PX_IMG_Emboss(src.get(), &other), 1u);
    EXPECT_EQ(other->bitCount, 32u);
}
