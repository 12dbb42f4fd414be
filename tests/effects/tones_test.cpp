// Colour tones against per-pixel versions of their formulas, the old-photograph
// table quirks, and the result-image rule on these effects.
#include <gtest/gtest.h>

#include "effect_check.hpp"
#include "effects/tone_tables.hpp"

using namespace pxtest;

namespace {

uint32_t ref_negative(uint32_t c, int, int) { return c ^ 0x00FFFFFFu; }

uint32_t ref_warm(uint32_t c, int, int) {
    const int b = chan(c, 0), g = chan(c, 8), r = chan(c, 16);
    const int r2 = std::min(r + (r >> 2), 255);
    return rgba(b - (b >> 4), std::max(g - (r2 >> 3), 0), r2, chan(c, 24));
}

uint32_t ref_cold(uint32_t c, int, int) {
    const int b = chan(c, 0), g = chan(c, 8), r = chan(c, 16);
    const int r2 = r - (r >> 2);
    return rgba(std::min(b + (b >> 2), 255), std::min(g + (r2 >> 4), 255), r2, chan(c, 24));
}

uint32_t ref_restored(uint32_t c, int, int) {
    const int m = (chan(c, 0) + chan(c, 8) + chan(c, 16)) / 3;
    return rgba(ltouc(m + 20), m, ltouc(m - 20), chan(c, 24));
}

uint32_t ref_line(uint32_t c, int, int y) {
    if (y % 3 == 2) return c;
    return rgba(std::max(chan(c, 0) - 128, 0), std::max(chan(c, 8) - 128, 0), std::max(chan(c, 16) - 128, 0),
                chan(c, 24));
}

uint32_t ref_old_photo(uint32_t c, int, int) {
    const int b = chan(c, 0), g = chan(c, 8), r = chan(c, 16);
    return rgba((b + pxfx::kOldPhotoBlue[b]) & 255, (g + pxfx::kOldPhotoGreen[g]) & 255,
                std::min(r + pxfx::kOldPhotoRed[r], 255), chan(c, 24));
}

template <class Ref> auto reference(Ref fn) {
    return [fn](const Image *src) { return per_pixel(src, fn); };
}

} // namespace

TEST(Tones, MatchPerPixelFormulasOnEveryFormat) {
    expect_like_reference(PX_IMG_Negative, reference(ref_negative), 1);
    expect_like_reference(PX_IMG_WARM_YELLOW, reference(ref_warm), 100);
    expect_like_reference(PX_IMG_COLD_PUPRLE, reference(ref_cold), 200);
    expect_like_reference(PX_IMG_Repristination, reference(ref_restored), 300);
    expect_like_reference(PX_IMG_Line, reference(ref_line), 400);
    expect_like_reference(PX_IMG_Classical_Photograph, reference(ref_old_photo), 500);
}

TEST(Tones, HandComputedPixels) {
    struct Case {
        uint32_t (*effect)(Image *, Image **);
        uint32_t in, out;
    } cases[] = {
        {PX_IMG_Negative, rgba(0, 100, 255, 7), rgba(255, 155, 0, 7)},
        {PX_IMG_WARM_YELLOW, rgba(160, 100, 255, 9), rgba(150, 69, 255, 9)}, // green loses 255 >> 3
        {PX_IMG_WARM_YELLOW, rgba(0, 3, 80, 9), rgba(0, 0, 100, 9)},         // green floors at 0
        {PX_IMG_COLD_PUPRLE, rgba(255, 255, 255, 9), rgba(255, 255, 192, 9)},
        {PX_IMG_COLD_PUPRLE, rgba(100, 50, 200, 9), rgba(125, 59, 150, 9)},
        {PX_IMG_Repristination, rgba(0, 0, 0, 9), rgba(20, 0, 0, 9)},
        {PX_IMG_Repristination, rgba(255, 255, 255, 9), rgba(255, 255, 235, 9)},
        {PX_IMG_Repristination, rgba(10, 20, 31, 9), rgba(40, 20, 0, 9)},
    };
    for (const Case &c : cases) {
        Owned src = filled(2, 2, 32, c.in);
        Slot dst;
        ASSERT_EQ(c.effect(src.get(), &dst), 1u);
        EXPECT_EQ(GetPixelColor(dst.get(), 1, 1), c.out) << std::hex << c.in;
    }
}

TEST(Tones, NegativeTwiceRestoresTheSource) {
    for (int32_t bc : kBitCounts) {
        Owned src = random_image(11, 5, bc, 7);
        Slot once, twice;
        ASSERT_EQ(PX_IMG_Negative(src.get(), &once), 1u);
        ASSERT_EQ(PX_IMG_Negative(once.get(), &twice), 1u);
        EXPECT_EQ(diff(twice.get(), src.get()), "") << bc;
    }
}

TEST(Tones, LineKeepsEveryThirdRow) {
    Owned one = filled(3, 1, 24, rgba(200, 100, 130, 255));
    Slot dst;
    ASSERT_EQ(PX_IMG_Line(one.get(), &dst), 1u);
    EXPECT_EQ(GetPixelColor(dst.get(), 2, 0), rgba(72, 0, 2, 255));
    Owned three = filled(2, 6, 32, rgba(200, 100, 130, 40));
    ASSERT_EQ(PX_IMG_Line(three.get(), &dst), 1u);
    for (int y = 0; y < 6; ++y)
        EXPECT_EQ(GetPixelColor(dst.get(), 0, y), y % 3 == 2 ? rgba(200, 100, 130, 40) : rgba(72, 0, 2, 40)) << y;
}

// Red sums clamp while green and blue wrap, and the tables are not monotone.
TEST(Tones, OldPhotographChannelAsymmetries) {
    struct Case {
        int b, g, r;
        uint32_t out;
    } cases[] = {
        {1, 1, 1, rgba(0, 0, 255, 255)},       // entries 255: red clamps, green and blue wrap to v - 1
        {40, 41, 40, rgba(34, 11, 255, 255)},  // red 40 + 255 clamps; green 41 + 226, blue 40 + 250 wrap
        {58, 149, 41, rgba(58, 148, 41, 255)}, // zero entries for blue 58 and red 41; green 149 + 255 wraps
        {254, 254, 254, rgba(253, 252, 255, 255)}, {255, 255, 255, rgba(253, 253, 255, 255)},
        {102, 139, 10, rgba(118, 132, 255, 255)}, // blue 102 + 16 (after 17 at 101); green 139 + 249
        {101, 138, 200, rgba(118, 132, 232, 255)},
    };
    for (const Case &c : cases) {
        Owned src = filled(1, 1, 24, rgba(c.b, c.g, c.r, 255));
        Slot dst;
        ASSERT_EQ(PX_IMG_Classical_Photograph(src.get(), &dst), 1u);
        EXPECT_EQ(GetPixelColor(dst.get(), 0, 0), c.out) << c.b << " " << c.g << " " << c.r;
    }
}

TEST(Tones, ResultRuleAndRefusals) {
    uint32_t (*effects[])(Image *, Image **) = {PX_IMG_Negative,
                                                PX_IMG_WARM_YELLOW,
                                                PX_IMG_COLD_PUPRLE,
                                                PX_IMG_Classical_Photograph,
                                                PX_IMG_Repristination,
                                                PX_IMG_Line,
                                                my};
    Owned src = random_image(5, 4, 32, 3);
    for (auto effect : effects) {
        Slot dst;
        dst.image = malloc_Image(5, 4, 32);
        Image *kept = dst.get();
        EXPECT_NE(effect(src.get(), &dst), 0u);
        EXPECT_EQ(dst.get(), kept);
        dst.image = (free_Image(&dst.image, 0), malloc_Image(4, 5, 32));
        EXPECT_NE(effect(src.get(), &dst), 0u);
        EXPECT_EQ(dst->width, 5);
        EXPECT_EQ(effect(nullptr, &dst), 0u);
        EXPECT_EQ(effect(src.get(), nullptr), 0u);
        Image hollow = *src;
        hollow.bits = nullptr;
        EXPECT_EQ(effect(&hollow, &dst), 0u);
    }
    // my only prepares the result: a new one stays white.
    Slot fresh;
    ASSERT_NE(my(src.get(), &fresh), 0u);
    EXPECT_EQ(GetPixelColor(fresh.get(), 2, 2), 0xFFFFFFFFu);
}
