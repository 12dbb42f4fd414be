// Hostile input for every colour function: the picture functions through the
// contract table, hue channels, masks and destinations at their extremes.
#include "support/hostile.hpp"

using namespace pxtest;
using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

// Pixel readers take any bit count (unknown ones read as opaque black).
const std::vector<int32_t> kAny = {8, 0, 1, 4, 12, 16, 24, 32, 48};
// Records of no pixels that a function with nothing to visit takes as done.
const std::vector<std::string> kEmptySizes = {"zero width", "negative height", "INT_MIN width"};

// Functions without a result slot, or for which a null slot means "in place".
Contract<Image> no_slot(const char *name, std::vector<int32_t> formats, std::function<int64_t(C &)> call) {
    return {.name = name, .formats = std::move(formats), .call = std::move(call), .slot = false};
}
// A failed working allocation of Filter leaves the prepared result in the slot.
Contract<Image> kernel_effect(const char *name, int32_t (*fn)(const Image *, Image **)) {
    return {
        .name = name, .formats = kAny, .call = [fn](C &c) { return fn(c.a, c.slot); }, .keeps_result_on_failure = true};
}

} // namespace

TEST(Hostile, ColourPictures) {
    static const std::vector<int32_t> big(256 * 256, 1); // kernels up to 256 x 256
    auto combine = no_slot("Combine", kAny, [](C &c) { return (c.out = Combine(c.a, c.b, c.b, c.b, c.p)) != nullptr; });
    combine.pictures = 2, combine.mismatch_fails = true;
    combine.accepts = {"null pixels", "second: null pixels"}; // planes without pixels read as 0
    auto hue = no_slot("BaseTran_Hue", {8}, [](C &c) { return BaseTran_Hue(c.a, c.p); }),
         ls = no_slot("BaseTran_LS", {8}, [](C &c) { return BaseTran_LS(c.a, c.p); });
    hue.accepts = ls.accepts = kEmptySizes;
    auto smooth = no_slot("PX_IMG_Smooth", kAny, [](C &c) { return PX_IMG_Smooth(c.a, c.slot, c.p); });
    smooth.typical = 50;
    check_contracts<Image>({
        {"Split", kAny,
         [](C &c) {
             Slot p2, p3, alpha;
             return Split(c.a, c.slot, &p2, &p3, &alpha, c.p);
         }},
        combine,
        hue,
        ls,
        {"PX_IMG_Transform", kAny, [](C &c) { return PX_IMG_Transform(c.a, c.slot, c.p, c.p & 3); }},
        no_slot("Filter", kAny, [](C &c) { return Filter(c.a, big.data(), c.p, c.p, c.p, nullptr, nullptr, c.p); }),
        kernel_effect("PX_IMG_Blur", PX_IMG_Blur),
        kernel_effect("PX_IMG_Soften", PX_IMG_Soften),
        kernel_effect("PX_IMG_Sharpen", PX_IMG_Sharpen),
        kernel_effect("PX_IMG_Emboss1", PX_IMG_Emboss1),
        no_slot("Filter_fast", {8, 12, 16, 24, 32, 48}, [](C &c) { return Filter_fast(c.a, c.p, c.p); }),
        smooth,
    });
}

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
            const bool empty = std::find(kEmptySizes.begin(), kEmptySizes.end(), bad->what) != kEmptySizes.end();
            const bool takesNothing = empty || bad->what == "null pixels";
            Owned got = make(9, 7, 8);
            ASSERT_EQ(Filter(&src->record, k3, 3, 16, 0, &bad->record, got.get(), 0), 1) << bad->what;
            EXPECT_EQ(diff(got.get(), empty ? white.get() : want.get()), "") << bad->what;
            const auto before = bad->snapshot();
            EXPECT_EQ(Filter(&src->record, k3, 3, 16, 0, nullptr, &bad->record, 0), takesNothing ? 1 : 0) << bad->what;
            EXPECT_TRUE(bad->snapshot() == before) << bad->what;
        }
}
