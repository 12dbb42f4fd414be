// Hostile input beyond the registry's contracts: hue channels, masks and
// destinations at their extremes.
#include "support/hostile.hpp"

using namespace pxtest;
using namespace pxtest::hostile;
using pxop::kEmptySizes;

TEST(Hostile, HueMasksAndDestinations) {
    // RGBtoHSL, HSLtoRGB, RGBtoYUV, YUVtoRGB, RGBtoYIQ, YIQtoRGB, RGBtoXYZ and
    // XYZtoRGB meet every byte value, 0 and 255 included, in the model
    // comparison of the conversion tests; matrixX is checked there too.
    for (uint16_t v : {0, 1, 255, 256, 65535})
        (void)(HueToRGB(v, 65535 - v, v) + HueToRGB(65535 - v, v, 65535 - v));
    // A mask whose rows overrun its block is ignored; one without pixels
    // limits the area to its size and selects everything there, one of an
    // empty size leaves nothing to filter. Such a dst takes nothing when it
    // has no pixels to take, and is refused when its rows overrun its block.
    const int32_t k3[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
    auto src = good<Image>(9, 7, 8, 41);
    Owned want = make(9, 7, 8), white = make(9, 7, 8);
    ASSERT_EQ(Filter(&src->record, k3, 3, 16, 0, nullptr, want.get(), 0), 1);
    EXPECT_EQ(Filter(&src->record, k3, 3, 16, 0, nullptr, make(4, 12, 8).get(), 0), 1); // any dst shape
    for (auto &bad : broken<Image>({8}))
        if (bad->what.rfind("bit count", 0) != 0) { // other bit counts select, or are not written
            const bool empty = pxop::find_kind(kEmptySizes, bad->what) != nullptr;
            const bool takesNothing = empty || bad->what == "null pixels";
            Owned got = make(9, 7, 8);
            ASSERT_EQ(Filter(&src->record, k3, 3, 16, 0, &bad->record, got.get(), 0), 1) << bad->what;
            EXPECT_EQ(diff(got.get(), empty ? white.get() : want.get()), "") << bad->what;
            const auto before = bad->snapshot();
            EXPECT_EQ(Filter(&src->record, k3, 3, 16, 0, nullptr, &bad->record, 0), takesNothing ? 1 : 0) << bad->what;
            EXPECT_TRUE(bad->snapshot() == before) << bad->what;
        }
}
