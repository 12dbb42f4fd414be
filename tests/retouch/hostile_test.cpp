// Hostile input for every retouching function.
#include <climits>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

const int32_t xs[] = {0, 4, -9, INT_MAX}, ys[] = {3, INT_MIN, 2, 6};

} // namespace

TEST(Hostile, Retouching) {
    const std::vector<int32_t> any = {8, 16, 24, 32, 0, 1, 4, 12, 48}, rgb = {24, 32};
    check_contracts<Image>({
        {"CreateFaceMaskImg", any, [](C &c) { return CreateFaceMaskImg(c.a, c.slot); }},
        {"SmileDetect", any, [](C &c) { return SmileDetect(c.a, c.slot, c.p); }},
        {.name = "alg_Img_smooth_1",
         .formats = any,
         .call = [](C &c) { return alg_Img_smooth_1(c.a, c.slot); },
         .keeps_result_on_failure = true},
        {.name = "alg_Img_smooth",
         .formats = any,
         .call = [](C &c) { return alg_Img_smooth(c.a, c.slot), 0; },
         .failure = kNoResult},
        {"alg_Img_Skin", any, [](C &c) { return alg_Img_Skin(c.a, c.slot, c.p); }},
        {.name = "LightUP", .formats = any, .call = [](C &c) { return LightUP(c.a); }, .slot = false},
        {.name = "Best_Color", .formats = {8}, .call = [](C &c) { return Best_Color(c.a, c.p); }, .slot = false},
        {.name = "MoreLight",
         .formats = any,
         .call = [](C &c) { return MoreLight(c.a, c.p, c.slot), 0; },
         .failure = kNoResult},
        {"ImageAutoGradationProcess", any, [](C &c) { return ImageAutoGradationProcess(c.a, c.slot, c.p); }},
        {.name = "ImageAutoGradationProcess1",
         .formats = any,
         .call = [](C &c) { return ImageAutoGradationProcess1(c.a, c.slot, c.p, c.p), 0; },
         .failure = kNoResult},
        {"ImageExposure", any, [](C &c) { return ImageExposure(c.a, c.slot, c.p); }},
        {.name = "MyOneKeyFliter",
         .formats = {8},
         .call = [](C &c) { return MyOneKeyFliter(c.a, c.slot); },
         .slot = false},
        {.name = "MyOneKeyFliter in place",
         .formats = {8},
         .call = [](C &c) { return MyOneKeyFliter(c.a, nullptr); },
         .slot = false},
        {.name = "thresholdBlur",
         .formats = any,
         .call = [](C &c) { return thresholdBlur(c.p, c.p, c.p, c.p, c.a, c.slot), 0; },
         .failure = kNoResult},
        {.name = "PointArea_Copy",
         .formats = any,
         .call = [](C &c) { return PointArea_Copy(c.a, c.b, c.p, c.p, c.p); },
         .pictures = 2,
         .formats_b = any,
         .slot = false},
        {.name = "PointArea_Copy_Alph",
         .formats = any,
         .call = [](C &c) { return PointArea_Copy_Alph(c.a, c.b, c.p, c.p, c.p, c.p); },
         .pictures = 2,
         .formats_b = any,
         .slot = false},
        {"PX_Mimic", any, [](C &c) { return PX_Mimic(c.a, c.p, c.p, nullptr, 0, 0, c.p, c.p, c.p, 1, c.slot); }},
        {.name = "alg_Blending",
         .formats = rgb,
         .call =
             [](C &c) {
                 return alg_Blending(c.a, nullptr, c.p, c.p, PXTint{201, 90, 30}, c.p, c.slot);
             },
         .slot = false},
        {.name = "alg_Img_Blending",
         .formats = rgb,
         .call = [](C &c) { return alg_Img_Blending(c.a, c.slot); },
         .slot = false},
        {.name = "alg_Img_Blending in place",
         .formats = rgb,
         .call = [](C &c) { return alg_Img_Blending(c.a, nullptr); },
         .slot = false},
        {.name = "alg_smooth",
         .formats = rgb,
         .call = [](C &c) { return alg_smooth(c.a, 0, c.p, c.p, c.p, c.p, c.slot); },
         .slot = false},
        {.name = "alg_Img_Eradicate",
         .formats = any,
         .call = [](C &c) { return alg_Img_Eradicate(c.a, c.p, c.p, c.p), 0; },
         .failure = kNoResult,
         .slot = false},
        {.name = "alg_Img_EyesEnlarge",
         .formats = any,
         .call =
             [](C &c) {
                 alg_Img_EyesEnlarge_ellipse(c.a, c.p, 3, c.p);
                 alg_Img_EyesEnlarge_circle(c.a, 3, c.p, c.p);
                 return alg_Img_EyesEnlarge(c.a, c.p, c.p, c.p, c.p), 0;
             },
         .failure = kNoResult,
         .slot = false},
        {.name = "EyesEnlarge", .formats = any, .call = [](C &c) { return EyesEnlarge(c.a); }, .slot = false},
        {.name = "alg_Img_EyesMoreContrast_ellipse",
         .formats = any,
         .call = [](C &c) { return alg_Img_EyesMoreContrast_ellipse(c.a, c.p, 3, c.p, c.p), 0; },
         .failure = kNoResult,
         .slot = false},
        {.name = "alg_Img_quheiyanquan_ellipse",
         .formats = any,
         .call = [](C &c) { return alg_Img_quheiyanquan_ellipse(c.a, c.p, c.p, c.p), 0; },
         .failure = kNoResult,
         .slot = false},
        {.name = "alg_QuHeiYanQuan",
         .formats = rgb,
         .call = [](C &c) { return alg_QuHeiYanQuan(c.a, c.p, c.p, c.p, c.p, c.slot, 1); },
         .slot = false},
        {.name = "alg_QuHeiYanQuan_1",
         .formats = rgb,
         .call = [](C &c) { return alg_QuHeiYanQuan_1(c.a, xs, ys, 4, c.p, c.p); },
         .slot = false},
    });
}

TEST(Hostile, RetouchScalars) {
    auto pic = good<Image>(9, 7, 24, 1), none = good<Image>(9, 7, 24, 2);
    none->record.bits = nullptr;
    Image *slot = nullptr;
    EXPECT_EQ(PX_Mimic(&pic->record, 0, 0, &none->record, 0, 0, 3, 3, 3, 1, &slot), 0);
    EXPECT_EQ(slot, nullptr);
    EXPECT_EQ(alg_QuHeiYanQuan_1(&pic->record, nullptr, ys, 2, 3, 9) +
                  alg_QuHeiYanQuan_1(&pic->record, xs, nullptr, 2, 3, 9),
              0);
    BuildTable(nullptr, 0.5f);
    MakeMapping(nullptr, 0.1f, 0.9f);
    ComputeBezier(nullptr, 3, nullptr);
    const PXPoint far[4] = {{INT_MIN, INT_MAX}, {INT_MAX, INT_MIN}, {INT_MIN, INT_MIN}, {INT_MAX, INT_MAX}};
    PXPoint pts[3];
    for (int32_t v : kExtremes) {
        int32_t values[4] = {v, 1, INT_MAX, 0};
        EXPECT_EQ(Sort_largelow(nullptr, v), nullptr);
        EXPECT_EQ(Sort_largelow(values, std::min(v, 4)), values);
        EXPECT_EQ(getpos(nullptr, v, v), v);
        ComputeBezier(far, v, nullptr);
        const PXPoint p = PointOnCubicBezier(nullptr, nullptr, float(v));
        EXPECT_EQ(p.x | p.y, 0);
        PointOnCubicBezier(pts + 2, far, float(v));
        ComputeBezier(far, std::min(v, 3), pts);
    }
    EXPECT_EQ(pts[0].x, INT_MIN);
}
