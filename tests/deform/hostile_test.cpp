// Hostile input beyond the registry's contracts: pair lists, counts and wave
// maps at their extremes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;

namespace {

const DeformationPair pairs[] = {{1, 1, 2, 2}, {1e300, 3, 4, -1e300}, {5, INT_MIN, INT_MAX, 6}, {NAN, 1, 1, INFINITY}};
int16_t wave_map[16 * 16];

} // namespace

TEST(Hostile, DeformationScalars) {
    auto pic = good<Image>(9, 7, 24, 1);
    const auto before = pic->snapshot();
    Image *slot = nullptr, *p = &pic->record;
    EXPECT_EQ(DeformationImage(p, nullptr, 2, &slot) + DeformationFunc(p, p, nullptr, 2) +
                  render_wave(p, p, nullptr, 0, 0),
              1);
    EXPECT_TRUE(slot == nullptr && pic->snapshot() == before);
    // Counts that name no pair (negative, or above 2^31 - 1 as the warp's
    // signed count) warp without pairs: every pixel goes to the centroid
    // (0, 0) of an empty set, the rest is filled from there.
    Image *none = nullptr;
    auto twin = good<Image>(9, 7, 24, 3);
    Image *q = &twin->record;
    ASSERT_EQ(DeformationImage(p, pairs, 0x80000000u, &slot) + DeformationImage(p, nullptr, 0, &none) +
                  DeformationFunc(p, q, pairs, -1),
              3);
    EXPECT_EQ(pxtest::diff(slot, none), "");
    EXPECT_EQ(pxtest::diff(q, none), "");
    free_Image(&slot, 0);
    free_Image(&none, 0);
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
