// Neon, emboss and the dispatcher against straightforward accessor versions,
// plus the result-image rule.
#include <gtest/gtest.h>

#include <cstdlib>

#include "effect_check.hpp"
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

// Through the dispatcher: 0 neon, 1 emboss (2 photocopy and 3 sketch beside their references).
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

// Sources of an empty size (see expect_slot_rule): 1 where nothing is drawn,
// 0 where a work buffer of that size cannot be had.
TEST(ResultRule, EmptySourcesAndReusedSlots) {
    const SlotRuleCase cases[] = {
        {"neon", PX_IMG_Neon, "1k 1k 1k 1k"},
        {"emboss", PX_IMG_Emboss, "1k 1k 1k 1k"},
        {"sketch", bind_slot(PX_ProcessImage, 3u), "0k 0k 0k 1k"}, // 4 x width x height bytes of planes
        {"sketch 1", PX_IMG_Sketch_1, "0k 0k 0k 1k"},
        {"photocopy", PX_IMG_Photocopy, "1k 0r 1k 1k"}, // 5 x stride x height + 8000 bytes
        {"negative", PX_IMG_Negative, "1k 1k 1k 1k"},
        {"warm", PX_IMG_WARM_YELLOW, "1k 1k 1k 1k"},
        {"cold", PX_IMG_COLD_PUPRLE, "1k 1k 1k 1k"},
        {"old photo", PX_IMG_Classical_Photograph, "1k 1k 1k 1k"},
        {"restored", PX_IMG_Repristination, "1k 1k 1k 1k"},
        {"line", PX_IMG_Line, "1k 1k 1k 1k"},
        {"my", my, "1k 1k 1k 1k"},
        {"light 50", bind_slot(PX_IMG_Light_Alter, 50u, 3u), "1k 1k 1k 1k"},
        {"light 0", bind_slot(PX_IMG_Light_Alter, 0u, 3u), "1z 1z 1k 1k"},
        {"light 100", bind_slot(PX_IMG_Light_Alter, 100u, 3u), "1c 1c 1k 1k"},
        {"contrast 5", bind_slot(PX_IMG_Ballance, 5), "1k 1k 1k 1k"},
        {"contrast 0", bind_slot(PX_IMG_Ballance, 0), "1c 1c 1k 1k"},
        {"glow", PX_IMG_Lambency, "0k 0k 0k 0k"},               // its blurred image cannot be made
        {"mosaic", bind_slot(PX_IMG_Mosaic, 3), "0k 0k 1k 0k"}, // (width + 2) / 3 block colours
        {"aquarelle", bind_slot(PX_IMG_Aquarelle, 4), "1k 1k 1k 1k"},
        {"oil", bind_slot(imOil, 0), "0k 0k 0k 0k"}, // the window is larger than the picture
        {"oil 1", imOil_1, "0k 0k 0k 0k", false},    // no planes of that size
        {"alter", bind_slot(PX_IMG_Alter, 5, 6, 7, 2u), "1k 1k 1k 1k"},
    };
    for (const auto &c : cases)
        expect_slot_rule(c);
}
