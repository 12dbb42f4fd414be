// Hostile input for every effect (temp_ex, on a raw plane, has its null,
// empty and off-plane cases beside its other tests).
#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

// Effects read through the pixel readers, so any bit count works (unknown ones
// read as opaque black).
Contract<Image> effect(const char *name, std::function<int64_t(C &)> call) {
    return {name, {8, 0, 1, 4, 12, 16, 24, 32, 48}, std::move(call)};
}
Contract<Image> effect(const char *name, uint32_t (*fn)(Image *, Image **)) {
    return effect(name, [fn](C &c) { return int64_t(fn(c.a, c.slot)); });
}
// A failed working allocation leaves the prepared result in the slot.
Contract<Image> keeps(Contract<Image> c, int32_t typical = 3) {
    c.keeps_result_on_failure = true, c.typical = typical;
    return c;
}

} // namespace

TEST(Hostile, Effects) {
    check_contracts<Image>({
        keeps(effect("PX_ProcessImage", [](C &c) { return PX_ProcessImage(c.a, c.slot, c.p); })),
        effect("PX_IMG_Neon", PX_IMG_Neon),
        effect("PX_IMG_Emboss", PX_IMG_Emboss),
        effect("PX_IMG_Photocopy", PX_IMG_Photocopy),
        keeps(effect("PX_IMG_Sketch", PX_IMG_Sketch)),
        keeps(effect("PX_IMG_Sketch_1", PX_IMG_Sketch_1)),
        effect("PX_IMG_Negative", PX_IMG_Negative),
        effect("PX_IMG_WARM_YELLOW", PX_IMG_WARM_YELLOW),
        effect("PX_IMG_COLD_PUPRLE", PX_IMG_COLD_PUPRLE),
        effect("PX_IMG_Classical_Photograph", PX_IMG_Classical_Photograph),
        effect("PX_IMG_Repristination", PX_IMG_Repristination),
        effect("PX_IMG_Line", PX_IMG_Line),
        effect("my", my),
        effect("PX_IMG_Lambency", PX_IMG_Lambency),
        effect("PX_IMG_Light_Alter", [](C &c) { return PX_IMG_Light_Alter(c.a, c.slot, c.p, c.p); }),
        effect("PX_IMG_Ballance", [](C &c) { return PX_IMG_Ballance(c.a, c.slot, c.p); }),
        effect("PX_IMG_Mosaic", [](C &c) { return PX_IMG_Mosaic(c.a, c.slot, c.p); }),
        effect("PX_IMG_Aquarelle", [](C &c) { return PX_IMG_Aquarelle(c.a, c.slot, c.p); }),
        keeps(effect("imOil", [](C &c) { return imOil(c.a, c.slot, c.p); }), 1),
        {.name = "imOil_1",
         .formats = {24, 32},
         .call = [](C &c) { return imOil_1(c.a, c.slot); },
         .falls_back_on_failure = true}, // 1 with an empty slot when the joined image cannot be made
        {.name = "ColorCompress",
         .formats = {8},
         .call = [](C &c) { return ColorCompress(c.a, c.p); },
         .slot = false,
         .accepts = {"zero width", "negative height", "INT_MIN width"}},
        effect("PX_IMG_Alter", [](C &c) { return PX_IMG_Alter(c.a, c.slot, c.p, ~c.p, c.p, c.p); }),
    });
}
