// Colour tones: hand-computed pixels for every formula (with the quirks of the
// old-photograph tables), every format, and the result-image rule.
#include <gtest/gtest.h>

#include "effect_check.hpp"

using namespace pxtest;

using Effect = uint32_t (*)(Image *, Image **);

TEST(Tones, HandComputedPixels) {
    const struct {
        Effect effect;
        uint32_t in, out;
    } cases[] = {
        {PX_IMG_Negative, rgba(0, 100, 255, 7), rgba(255, 155, 0, 7)},
        {PX_IMG_WARM_YELLOW, rgba(160, 100, 255, 9), rgba(150, 69, 255, 9)}, // green - (255 >> 3)
        {PX_IMG_WARM_YELLOW, rgba(0, 3, 80, 9), rgba(0, 0, 100, 9)},         // green floors at 0
        {PX_IMG_COLD_PUPRLE, rgba(255, 255, 255, 9), rgba(255, 255, 192, 9)},
        {PX_IMG_COLD_PUPRLE, rgba(100, 50, 200, 9), rgba(125, 59, 150, 9)},
        {PX_IMG_Repristination, rgba(0, 0, 0, 9), rgba(20, 0, 0, 9)},
        {PX_IMG_Repristination, rgba(255, 255, 255, 9), rgba(255, 255, 235, 9)},
        {PX_IMG_Repristination, rgba(10, 20, 31, 9), rgba(40, 20, 0, 9)},
        // Old photograph: red sums clamp, green and blue wrap; tables are not monotone.
        {PX_IMG_Classical_Photograph, rgba(1, 1, 1, 9), rgba(0, 0, 255, 9)},
        {PX_IMG_Classical_Photograph, rgba(40, 41, 40, 9), rgba(34, 11, 255, 9)},
        {PX_IMG_Classical_Photograph, rgba(58, 149, 41, 9), rgba(58, 148, 41, 9)},
        {PX_IMG_Classical_Photograph, rgba(254, 254, 254, 9), rgba(253, 252, 255, 9)},
        {PX_IMG_Classical_Photograph, rgba(255, 255, 255, 9), rgba(253, 253, 255, 9)},
        {PX_IMG_Classical_Photograph, rgba(102, 139, 10, 9), rgba(118, 132, 255, 9)},
        {PX_IMG_Classical_Photograph, rgba(101, 138, 200, 9), rgba(118, 132, 232, 9)},
    };
    for (const auto &c : cases)
        expect_pixel(c.effect, c.in, c.out);
    for (Effect effect :
         {PX_IMG_Negative, PX_IMG_WARM_YELLOW, PX_IMG_COLD_PUPRLE, PX_IMG_Repristination, PX_IMG_Classical_Photograph})
        expect_format_consistent(effect, 1);
}

TEST(Tones, LineDarkensAllButEveryThirdRow) {
    expect_like_reference(
        PX_IMG_Line,
        [](const Image *s) {
            return per_pixel(s, [](uint32_t c, int, int y) {
                const auto dark = [&](int sh) { return std::max(chan(c, sh) - 128, 0); };
                return y % 3 == 2 ? c : rgba(dark(0), dark(8), dark(16), chan(c, 24));
            });
        },
        100);
}

TEST(Tones, ResultRuleAndRefusals) {
    Owned src = random_image(5, 4, 32, 3);
    Slot dst;
    Image *kept = dst.image = malloc_Image(5, 4, 32);
    for (Effect effect : {PX_IMG_Negative, PX_IMG_WARM_YELLOW, PX_IMG_COLD_PUPRLE, PX_IMG_Classical_Photograph,
                          PX_IMG_Repristination, PX_IMG_Line, my}) {
        EXPECT_NE(effect(src.get(), &dst), 0u);
        EXPECT_EQ(effect(nullptr, &dst) + effect(src.get(), nullptr), 0u);
    }
    EXPECT_EQ(dst.get(), kept);
}
