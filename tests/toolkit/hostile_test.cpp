// Hostile input beyond the registry's contracts: curve-filter masks, planes,
// rectangles, points and sorts at their extremes.
#include "support/hostile.hpp"

using namespace pxtest::hostile;
using pxop::point, pxop::ptr, pxop::rect;

TEST(Hostile, CurveFilterMasks) {
    // Masks without pixels or area select nothing; the others are refused.
    auto gray = good<Image>(9, 7, 8, 1), rgb = good<Image>(9, 7, 24, 2);
    const auto before = gray->snapshot(), rgbBefore = rgb->snapshot();
    for (auto &mask : broken<Image>({8})) {
        const int32_t want = pxop::find_kind(pxop::kPixelless, mask->what) ? 2 : 0;
        EXPECT_EQ(ColorFilter(&gray->record, 1, &mask->record) + ColorFilter24(&rgb->record, 1, &mask->record), want)
            << mask->what;
    }
    EXPECT_TRUE(gray->snapshot() == before && rgb->snapshot() == rgbBefore);
}

TEST(Hostile, PackedScalars) {
    PXImage_Free(nullptr);
    uint8_t plane[64] = {1, 200, 3}, out[64] = {};
    int32_t values[4] = {3, 1, 2, 0};
    EXPECT_EQ(px_PtInRect(nullptr, ptr(rect(5))) + px_PtInRect(ptr(point(1)), nullptr), 0);
    for (int32_t v : kExtremes) {
        const int32_t n = std::clamp(v, -1, 8), empty = std::min(n, 0);
        EXPECT_EQ(DualLinearIntepol(nullptr, n, n, out, 4, 4) + DualLinearIntepol(plane, 8, 8, nullptr, n, n), 0);
        // Negative destination heights leave nothing to do; KWB refuses the negative width.
        EXPECT_EQ(DualLinearIntepol(plane, n, n, out, n, n) + DualLinearIntepol_KWB(plane, n, n, out, n, n, v),
                  n > 0 ? 2 : (n < 0 ? 1 : 0));
        EXPECT_EQ(ProbabilityDensityValue(nullptr, n, n) + ProbabilityDensityValue(plane, empty, 8), 240);
        EXPECT_EQ(EffectPaint_GrayRowData(plane, empty, 4) + EffectPaint_BlueRowData(nullptr, n, n) +
                      PXImage_Stamp(nullptr, nullptr, nullptr),
                  0);
        px_ShellSort(nullptr, 0, v);
        px_ShellSort(values, 0, std::min(n, 3));
    }
}
