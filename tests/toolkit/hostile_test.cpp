// Hostile input for every toolkit function.
#include <climits>
#include <cmath>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using P = Call<PXImage>;
using C = Call<Image>;

TEST(Hostile, PackedImages) {
    const std::vector<int32_t> geo = {8, 16, 24}, every(std::begin(kBitCountsTried), std::end(kBitCountsTried));
    static auto frame = good<PXImage>(720, 566, 24, 5), photo = good<PXImage>(9, 7, 24, 7);
    // Functions returning a new record: no slot.
    auto made = [](const char *name, std::function<PXImage *(PXImage *, int32_t)> f) {
        return Contract<PXImage>{.name = name,
                                 .formats = {8, 16, 24},
                                 .call = [f](P &c) { return (c.out = f(c.a, c.p)) != nullptr; },
                                 .slot = false};
    };
    check_contracts<PXImage>({
        made("PXImage_Resize", [](PXImage *a, int32_t p) { return PXImage_Resize(a, p, 3); }),
        made("PXImage_Crop",
             [](PXImage *a, int32_t p) {
                 const PXRect r{1, p, p, 0};
                 return PXImage_Crop(a, &r);
             }),
        made("PXImage_Rotate90", [](PXImage *a, int32_t) { return PXImage_Rotate90(a); }),
        made("PXImage_Rotate180", [](PXImage *a, int32_t) { return PXImage_Rotate180(a); }),
        made("PXImage_Rotate270", [](PXImage *a, int32_t) { return PXImage_Rotate270(a); }),
        made("PXImage_ZoomIn", [](PXImage *a, int32_t) { return PXImage_ZoomIn(a); }),
        made("PXImage_ZoomOut", [](PXImage *a, int32_t) { return PXImage_ZoomOut(a); }),
        {.name = "PXImage_ROI_Zoom",
         .formats = {32},
         .call =
             [](P &c) {
                 const PXRect r{1, c.p, c.p, 0};
                 return PXImage_ROI_Zoom(c.a, c.b, &r, c.p / 3.0, c.p, 1);
             },
         .pictures = 2,
         .slot = false},
        {.name = "PXImage_IsSameImage",
         .formats = {8, 24, 32},
         .call = [](P &c) { return PXImage_IsSameImage(c.a, c.b); },
         .pictures = 2,
         .slot = false,
         .mismatch_fails = true},
        {.name = "PXImage_AutoExposure",
         .formats = geo,
         .call = [](P &c) { return PXImage_AutoExposure(c.a); },
         .slot = false},
        {.name = "PXImage_AutoExposure_1",
         .formats = geo,
         .call = [](P &c) { return PXImage_AutoExposure_1(c.a); },
         .slot = false},
        {.name = "PXImage_AutoWhiteBalance",
         .formats = {8, 24},
         .call =
             [](P &c) {
                 const PXPoint pt{c.p, c.p};
                 return PXImage_AutoWhiteBalance(c.a, &pt);
             },
         .slot = false},
        {.name = "PXImage_BlueEnhancement",
         .formats = geo,
         .call = [](P &c) { return PXImage_BlueEnhancement(c.a); },
         .slot = false},
        {.name = "PXImage_GreenChannel",
         .formats = {24, 32},
         .call = [](P &c) { return PXImage_GreenChannel(c.a); },
         .slot = false},
        {.name = "PXImage_Sharpen",
         .formats = every,
         .call = [](P &c) { return PXImage_Sharpen(c.a, c.p); },
         .slot = false},
        {.name = "PXImage_Smooth",
         .formats = every,
         .call = [](P &c) { return PXImage_Smooth(c.a, c.p); },
         .slot = false},
        {.name = "PXImage_EdgeDetection",
         .formats = every,
         .call = [](P &c) { return PXImage_EdgeDetection(c.a); },
         .slot = false},
        {.name = "PXImage_GrayToBinarization",
         .formats = geo,
         .call = [](P &c) { return PXImage_GrayToBinarization(c.a); },
         .slot = false},
        {.name = "PXImage_Effect_Clip photo",
         .formats = {8, 24},
         .call = [](P &c) { return (c.out = PXImage_Effect_Clip(c.a, &frame->record)) != nullptr; },
         .slot = false},
        {.name = "PXImage_Effect_Clip frame",
         .formats = {24},
         .call = [](P &c) { return (c.out = PXImage_Effect_Clip(&photo->record, c.a)) != nullptr; },
         .slot = false},
        {.name = "PXImage_Effect_Paint",
         .formats = {8, 24},
         .call = [](P &c) { return PXImage_Effect_Paint(c.a); },
         .failure = kNoResult,
         .slot = false},
    });
}

TEST(Hostile, CurveFilters) {
    check_contracts<Image>({
        {.name = "ColorFilter",
         .formats = {8},
         .call = [](C &c) { return ColorFilter(c.a, c.p, nullptr); },
         .slot = false},
        {.name = "ColorFilter24",
         .formats = {24},
         .call = [](C &c) { return ColorFilter24(c.a, c.p, nullptr); },
         .slot = false},
        {.name = "ColorFilter1", .formats = {8}, .call = [](C &c) { return ColorFilter1(c.a, c.p); }, .slot = false},
        {.name = "ColorFilter_zanto",
         .formats = {8},
         .call = [](C &c) { return ColorFilter_zanto(c.a, c.p); },
         .slot = false},
    });
    auto gray = good<Image>(9, 7, 8, 1), rgb = good<Image>(9, 7, 24, 2);
    for (auto &mask : broken<Image>({8})) {
        const auto before = gray->snapshot();
        EXPECT_EQ(ColorFilter(&gray->record, 0x123456, &mask->record), 0) << mask->what;
        EXPECT_EQ(ColorFilter24(&rgb->record, 0x123456, &mask->record), 0) << mask->what;
        EXPECT_TRUE(gray->snapshot() == before) << mask->what;
    }
}

TEST(Hostile, PackedScalars) {
    PXImage_Free(nullptr);
    uint8_t plane[64] = {1, 200, 3}, out[64] = {};
    int32_t values[4] = {3, 1, 2, 0};
    const PXRect rect{0, 5, 5, 0};
    const PXPoint pt{1, 1};
    EXPECT_EQ(px_PtInRect(nullptr, &rect) + px_PtInRect(&pt, nullptr) + PXImage_Stamp(nullptr, nullptr, nullptr), 0);
    for (int32_t v : kExtremes) {
        const int32_t n = std::clamp(v, -1, 8);
        EXPECT_EQ(DualLinearIntepol(nullptr, n, n, out, 4, 4) + DualLinearIntepol(plane, 8, 8, nullptr, n, n), 0);
        EXPECT_EQ(DualLinearIntepol(plane, n, n, out, n, n), n > 0);
        EXPECT_EQ(DualLinearIntepol_KWB(plane, n, n, out, n, n, float(v)), n > 0);
        EXPECT_EQ(ProbabilityDensityValue(nullptr, n, n), 120);
        if (n <= 0) {
            EXPECT_EQ(ProbabilityDensityValue(plane, n, 8) + ProbabilityDensityValue(plane, 8, v), 240);
        }
        EXPECT_EQ(EffectPaint_GrayRowData(nullptr, n, n) + EffectPaint_BlueRowData(nullptr, n, n), 0);
        if (n <= 0) {
            EXPECT_EQ(EffectPaint_GrayRowData(plane, n, 4) + EffectPaint_BlueRowData(plane, 4, v), 0);
        }
        EXPECT_EQ(px_sqrt(v), v > 0 ? int32_t(std::sqrt(double(v))) : 0);
        px_ShellSort(nullptr, 0, v);
        px_ShellSort(values, 0, std::min(n, 3));
    }
}
