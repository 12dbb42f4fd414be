// Neon, emboss and the dispatcher against straightforward accessor versions,
// plus the result-image rule on the branches the registry does not reach.
#include "support/reference_check.hpp"
#include "support/slot_rule.hpp"

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

// Through the dispatcher: 0 neon, 1 emboss.
TEST(NeonEmboss, MatchAccessorVersionsOnEveryFormat) {
    expect_like_reference([](Image *s, Image **d) { return PX_ProcessImage(s, d, 0); }, reference_neon, 1);
    expect_like_reference([](Image *s, Image **d) { return PX_ProcessImage(s, d, 1); }, reference_emboss, 100);
}

// A fitting result is reused as it stands: the unwritten last row and column keep their bytes.
TEST(NeonEmboss, ReusedResultKeepsItsBorder) {
    Owned src = random_image(6, 4, 32, 9);
    Slot dst;
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    SetPixelColor(dst.get(), 5, 3, 0x01020304);
    ASSERT_EQ(PX_IMG_Neon(src.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 5, 3), 0x01020304u);
}

// Sources of an empty size on the branches the registry's typical calls do
// not take: the 0 % light clears the matching slot, the 100 % light and the
// plain contrast copy the source's block into it.
TEST(ResultRule, EmptySourcesOnUnscaledBranches) {
    const SlotRuleCase cases[] = {
        {"light 0", bind_slot(PX_IMG_Light_Alter, 0u, 3u), "1z 1z 1k 1k"},
        {"light 100", bind_slot(PX_IMG_Light_Alter, 100u, 3u), "1c 1c 1k 1k"},
        {"contrast 0", bind_slot(PX_IMG_Ballance, 0), "1c 1c 1k 1k"},
    };
    for (const auto &c : cases)
        expect_slot_rule(c);
}
