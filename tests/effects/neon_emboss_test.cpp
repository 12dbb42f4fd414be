// Neon, emboss and the dispatcher against straightforward accessor versions,
// plus the result-image rule.
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <functional>
#include <vector>

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

// A caller's record allocated as the library allocates (so that an effect may
// release it), its block filled with 0x5A.
Image *hand_made(int32_t w, int32_t h, uint32_t pitch, size_t bytes) {
    Image *im = static_cast<Image *>(PX_malloc(sizeof(Image)));
    *im = Image{w, h, 24, bytes ? static_cast<uint8_t *>(PX_malloc(bytes)) : nullptr, pitch, 0};
    if (bytes) std::memset(im->bits, 0x5A, bytes);
    return im;
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

// Sources of an empty size with a matching record in the slot, which is
// reused: the effect returns what its steps give, 1 (nothing to draw) or 0
// where a work buffer of that size cannot be had, and the slot record is kept
// (k), cleared over the block it claims (z), given the source's block (c) or
// released (r). A reused record without pixels is drawn into by nothing (1).
TEST(ResultRule, EmptySourcesAndReusedSlots) {
    using Effect = std::function<uint32_t(Image *, Image **)>;
    const auto bind = [](auto fn, auto... args) {
        return Effect([=](Image *s, Image **d) { return fn(s, d, args...); });
    };
    const struct {
        const char *name;
        Effect effect;
        const char *want; // zero width, INT_MIN width, negative height, both negative
    } cases[] = {
        {"neon", PX_IMG_Neon, "1k 1k 1k 1k"},
        {"emboss", PX_IMG_Emboss, "1k 1k 1k 1k"},
        {"sketch", bind(PX_ProcessImage, 3u), "0k 0k 0k 1k"}, // 4 x width x height bytes of planes
        {"sketch 1", PX_IMG_Sketch_1, "0k 0k 0k 1k"},
        {"photocopy", PX_IMG_Photocopy, "1k 0r 1k 1k"}, // 5 x stride x height + 8000 bytes
        {"negative", PX_IMG_Negative, "1k 1k 1k 1k"},
        {"warm", PX_IMG_WARM_YELLOW, "1k 1k 1k 1k"},
        {"cold", PX_IMG_COLD_PUPRLE, "1k 1k 1k 1k"},
        {"old photo", PX_IMG_Classical_Photograph, "1k 1k 1k 1k"},
        {"restored", PX_IMG_Repristination, "1k 1k 1k 1k"},
        {"line", PX_IMG_Line, "1k 1k 1k 1k"},
        {"my", my, "1k 1k 1k 1k"},
        {"light 50", bind(PX_IMG_Light_Alter, 50u, 3u), "1k 1k 1k 1k"},
        {"light 0", bind(PX_IMG_Light_Alter, 0u, 3u), "1z 1z 1k 1k"},
        {"light 100", bind(PX_IMG_Light_Alter, 100u, 3u), "1c 1c 1k 1k"},
        {"contrast 5", bind(PX_IMG_Ballance, 5), "1k 1k 1k 1k"},
        {"contrast 0", bind(PX_IMG_Ballance, 0), "1c 1c 1k 1k"},
        {"glow", PX_IMG_Lambency, "0k 0k 0k 0k"},          // its blurred image cannot be made
        {"mosaic", bind(PX_IMG_Mosaic, 3), "0k 0k 1k 0k"}, // (width + 2) / 3 block colours
        {"aquarelle", bind(PX_IMG_Aquarelle, 4), "1k 1k 1k 1k"},
        {"oil", bind(imOil, 0), "0k 0k 0k 0k"}, // the window is larger than the picture
        {"oil 1", imOil_1, "0k 0k 0k 0k"},      // no planes of that size
        {"alter", bind(PX_IMG_Alter, 5, 6, 7, 2u), "1k 1k 1k 1k"},
    };
    const int32_t shapes[][4] = {{0, 7, 12, 84}, {INT32_MIN, 7, 12, 84}, {9, -7, 28, 64}, {-9, -7, 28, 64}};
    for (const auto &c : cases) {
        for (int i = 0; i < 4; ++i) {
            const auto [w, h, pitch, bytes] = shapes[i];
            std::vector<uint8_t> block(static_cast<size_t>(bytes));
            for (size_t j = 0; j < block.size(); ++j)
                block[j] = uint8_t(j * 7 + 1);
            Image src{w, h, 24, block.data(), uint32_t(pitch), 0};
            Image *kept = hand_made(w, h, uint32_t(pitch), size_t(bytes)), *slot = kept;
            const char ret = c.want[3 * i], what = c.want[3 * i + 1];
            EXPECT_EQ(c.effect(&src, &slot), uint32_t(ret - '0')) << c.name << " " << i;
            if (what == 'r') {
                EXPECT_EQ(slot, nullptr) << c.name << " " << i;
                continue;
            }
            ASSERT_EQ(slot, kept) << c.name << " " << i;
            const std::vector<uint8_t> got(slot->bits, slot->bits + bytes);
            const std::vector<uint8_t> want = what == 'z'   ? std::vector<uint8_t>(size_t(bytes))
                                              : what == 'c' ? block
                                                            : std::vector<uint8_t>(size_t(bytes), 0x5A);
            EXPECT_TRUE(got == want) << c.name << " " << i;
            free_Image(&slot, 0);
        }
        if (c.name == std::string("oil 1")) continue; // it overwrites the slot without looking at it
        Owned src = random_image(9, 7, 24, 5);
        Image *hollow = hand_made(9, 7, 28, 0), *slot = hollow;
        EXPECT_EQ(c.effect(src.get(), &slot), 1u) << c.name;
        EXPECT_TRUE(slot == hollow && slot->bits == nullptr) << c.name;
        free_Image(&slot, 0);
    }
}
