// Hostile input for every deformation function.
#include <climits>
#include <cmath>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

const std::vector<int32_t> all = {8, 16, 24, 32, 0, 1, 4, 12, 48};
const DeformationPair pairs[] = {{1, 1, 2, 2}, {1e300, 3, 4, -1e300}, {5, INT_MIN, INT_MAX, 6}, {NAN, 1, 1, INFINITY}};
int16_t wave_map[16 * 16];

// Functions writing one picture into another of the same size.
Contract<Image> two(const char *name, int64_t (*f)(C &), int64_t failure = 0) {
    return {name, all, f, failure, 2, {}, false, true};
}

} // namespace

TEST(Hostile, Deformations) {
    Contract<Image> warp{"DeformationImage", all, [](C &c) { return DeformationImage(c.a, pairs, 4, c.slot); }};
    warp.keeps_result_on_failure = true;
    check_contracts<Image>({
        {"CircleTransform", all, [](C &c) { return CircleTransform(c.a, c.slot, c.p, c.p, float(c.p)); }},
        {"Punch_Transform", all, [](C &c) { return Punch_Transform(c.a, c.slot); }},
        {"Pinch_Transform", all, [](C &c) { return Pinch_Transform(c.a, c.slot); }},
        {"Swirl_Transform", all, [](C &c) { return Swirl_Transform(c.a, c.slot); }},
        {"Cylinder_Transform", all, [](C &c) { return Cylinder_Transform(c.a, c.slot); }},
        {"Bathroom_Transform", all, [](C &c) { return Bathroom_Transform(c.a, c.slot); }},
        {"Wave_Transform", all, [](C &c) { return Wave_Transform(c.a, c.slot, c.p); }},
        warp,
        two("DeformationFunc", [](C &c) -> int64_t { return DeformationFunc(c.a, c.b, pairs, 4); }),
        two(
            "render_wave", [](C &c) -> int64_t { return render_wave(c.a, c.b, wave_map, c.p, c.p); }, kNoResult),
    });
}

TEST(Hostile, DeformationScalars) {
    auto pic = good<Image>(9, 7, 24, 1);
    const auto before = pic->snapshot();
    Image *slot = nullptr, *p = &pic->record;
    EXPECT_EQ(DeformationImage(p, nullptr, 2, &slot) + DeformationImage(p, pairs, 0x80000000u, &slot) +
                  DeformationFunc(p, p, nullptr, 2) + DeformationFunc(p, p, pairs, -1) +
                  render_wave(p, p, nullptr, 0, 0),
              1);
    EXPECT_TRUE(slot == nullptr && pic->snapshot() == before);
    const int32_t xy[] = {INT_MAX, INT_MIN};
    const double weights[] = {1e300};
    for (int32_t v : kExtremes) {
        const PXPoint a = WeightedCentroid(xy, nullptr, v), b = WeightedCentroid(nullptr, weights, v),
                      c = WeightedCentroid(xy, weights, std::min(v, 0));
        EXPECT_EQ(a.x | a.y | b.x | b.y | c.x | c.y, 0);
        EXPECT_EQ(create_wave(nullptr, 5, 3, v, v, v) +
                      create_wave(wave_map, std::min(v, 16), std::min(v, 16), v, v / -2, v),
                  2);
    }
    WeightedCentroid(xy, weights, 1);
}
