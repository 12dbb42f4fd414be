// Hostile input for every deformation function.
#include <climits>
#include <cmath>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

// Pairs whose coordinates follow the parameter under test.
std::vector<DeformationPair> pairs_for(int32_t p) {
    const double v = p;
    return {{1, 1, 2, 2}, {v, 3, 4, v / 2}, {5, v, -v, 6}, {NAN, 1, 1, INFINITY}};
}

int16_t wave_map[16 * 16];

} // namespace

TEST(Hostile, Deformations) {
    const std::vector<int32_t> all = {8, 16, 24, 32, 0, 1, 4, 12, 48};
    check_contracts<Image>({
        {"CircleTransform", all, [](C &c) { return CircleTransform(c.a, c.slot, c.p, c.p, float(c.p)); }},
        {"Punch_Transform", all, [](C &c) { return Punch_Transform(c.a, c.slot); }},
        {"Pinch_Transform", all, [](C &c) { return Pinch_Transform(c.a, c.slot); }},
        {"Swirl_Transform", all, [](C &c) { return Swirl_Transform(c.a, c.slot); }},
        {"Cylinder_Transform", all, [](C &c) { return Cylinder_Transform(c.a, c.slot); }},
        {"Bathroom_Transform", all, [](C &c) { return Bathroom_Transform(c.a, c.slot); }},
        {"Wave_Transform", all, [](C &c) { return Wave_Transform(c.a, c.slot, c.p); }},
        {.name = "DeformationImage",
         .formats = all,
         .call =
             [](C &c) {
                 const auto pairs = pairs_for(c.p);
                 return DeformationImage(c.a, pairs.data(), uint32_t(pairs.size()), c.slot);
             },
         .keeps_result_on_failure = true},
        {.name = "DeformationFunc",
         .formats = all,
         .call =
             [](C &c) {
                 const auto pairs = pairs_for(c.p);
                 return DeformationFunc(c.a, c.b, pairs.data(), int32_t(pairs.size()));
             },
         .pictures = 2,
         .slot = false,
         .mismatch_fails = true},
        {.name = "render_wave",
         .formats = all,
         .call = [](C &c) { return render_wave(c.a, c.b, wave_map, c.p, c.p); },
         .failure = kNoResult,
         .pictures = 2,
         .slot = false,
         .mismatch_fails = true},
    });
}

TEST(Hostile, DeformationScalars) {
    auto good = pxtest::hostile::good<Image>(9, 7, 24, 1);
    Image *slot = nullptr;
    EXPECT_EQ(DeformationImage(&good->record, nullptr, 2, &slot) +
                  DeformationImage(&good->record, pairs_for(1).data(), 0x80000000u, &slot) +
                  DeformationFunc(&good->record, &good->record, nullptr, 2) +
                  DeformationFunc(&good->record, &good->record, pairs_for(1).data(), -1),
              0);
    EXPECT_EQ(slot, nullptr);
    const auto before = good->snapshot();
    EXPECT_EQ(render_wave(&good->record, &good->record, nullptr, 0, 0), 1);
    EXPECT_TRUE(good->snapshot() == before);
    const int32_t points[] = {INT_MAX, INT_MIN, INT_MAX, INT_MAX};
    const double weights[] = {1e300, 1e300};
    for (int32_t v : kExtremes) {
        EXPECT_EQ(create_wave(nullptr, 5, 3, v, v, v), 1);
        EXPECT_EQ(create_wave(wave_map, std::min(v, 16), std::min(v, 16), v, v / -2, v), 1);
        const PXPoint none = WeightedCentroid(points, nullptr, v),
                      far = WeightedCentroid(points, weights, v > 0 ? 2 : v);
        EXPECT_EQ(none.x | none.y | WeightedCentroid(nullptr, weights, v).x, 0);
        if (v <= 0) {
            EXPECT_EQ(far.x | far.y, 0);
        }
    }
}
