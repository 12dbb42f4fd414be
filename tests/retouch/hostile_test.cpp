// Hostile input for every retouching function.
#include <climits>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using C = Call<Image>;

namespace {

const std::vector<int32_t> any = {8, 16, 24, 32, 0, 1, 4, 12, 48}, rgb = {24, 32};
const int32_t xs[] = {0, 4, -9, INT_MAX}, ys[] = {3, INT_MIN, 2, 6};

// Functions changing their picture, with an optional slot or none, and
// functions returning nothing (failure kNoResult).
Contract<Image> no_slot(const char *name, std::vector<int32_t> formats, int64_t (*f)(C &), int64_t failure = 0) {
    return {name, formats, f, failure, 1, {}, false};
}
// Pastes of a second picture of any size and bit count.
Contract<Image> paste(const char *name, int32_t (*f)(Image *, Image *, int32_t)) {
    return {name, any, [f](C &c) -> int64_t { return f(c.a, c.b, c.p); }, 0, 2, {}, false};
}

} // namespace

TEST(Hostile, Retouching) {
    // The smoothing leaves its prepared result in the slot when it fails for want of memory.
    Contract<Image> spots{"alg_Img_smooth_1", any, [](C &c) { return alg_Img_smooth_1(c.a, c.slot); }},
        lightened{"alg_Img_smooth", any, [](C &c) { return alg_Img_smooth(c.a, c.slot), 0; }, kNoResult},
        skin{"alg_Img_Skin", any, [](C &c) { return alg_Img_Skin(c.a, c.slot, c.p); }};
    for (auto *c : {&spots, &lightened, &skin})
        c->keeps_result_on_failure = true;
    check_contracts<Image>({
        spots,
        lightened,
        skin,
        {"CreateFaceMaskImg", any, [](C &c) { return CreateFaceMaskImg(c.a, c.slot); }},
        {"SmileDetect", any, [](C &c) { return SmileDetect(c.a, c.slot, c.p); }},
        {"MoreLight", any, [](C &c) { return MoreLight(c.a, c.p, c.slot), 0; }, kNoResult},
        {"ImageAutoGradationProcess", any, [](C &c) { return ImageAutoGradationProcess(c.a, c.slot, c.p); }},
        {"ImageAutoGradationProcess1", any, [](C &c) { return ImageAutoGradationProcess1(c.a, c.slot, c.p, c.p), 0; },
         kNoResult},
        {"ImageExposure", any, [](C &c) { return ImageExposure(c.a, c.slot, c.p); }},
        {"thresholdBlur", any, [](C &c) { return thresholdBlur(c.p, c.p, c.p, c.p, c.a, c.slot), 0; }, kNoResult},
        {"PX_Mimic", any, [](C &c) { return PX_Mimic(c.a, c.p, c.p, nullptr, 0, 0, c.p, c.p, c.p, 1, c.slot); }},
        no_slot("LightUP", any, [](C &c) -> int64_t { return LightUP(c.a); }),
        no_slot("Best_Color", {8}, [](C &c) -> int64_t { return Best_Color(c.a, c.p); }),
        no_slot("MyOneKeyFliter", {8}, [](C &c) -> int64_t { return MyOneKeyFliter(c.a, c.slot); }),
        no_slot("MyOneKeyFliter in place", {8}, [](C &c) -> int64_t { return MyOneKeyFliter(c.a, nullptr); }),
        paste("PointArea_Copy", [](auto a, auto b, int32_t p) { return PointArea_Copy(a, b, p, p, p); }),
        paste("PointArea_Copy_Alph", [](auto a, auto b, int32_t p) { return PointArea_Copy_Alph(a, b, p, p, p, p); }),
        no_slot("alg_Blending", rgb,
                [](C &c) -> int64_t {
                    return alg_Blending(c.a, nullptr, c.p, c.p, {201, 90, 30}, c.p, c.slot);
                }),
        no_slot("alg_Img_Blending", rgb, [](C &c) -> int64_t { return alg_Img_Blending(c.a, c.slot); }),
        no_slot("alg_Img_Blending in place", rgb, [](C &c) -> int64_t { return alg_Img_Blending(c.a, nullptr); }),
        no_slot("alg_smooth", rgb, [](C &c) -> int64_t { return alg_smooth(c.a, 0, c.p, c.p, c.p, c.p, c.slot); }),
        no_slot("alg_QuHeiYanQuan", rgb,
                [](C &c) -> int64_t { return alg_QuHeiYanQuan(c.a, c.p, c.p, c.p, c.p, c.slot, 1); }),
        no_slot("alg_QuHeiYanQuan_1", rgb,
                [](C &c) -> int64_t { return alg_QuHeiYanQuan_1(c.a, xs, ys, 4, c.p, c.p); }),
        no_slot("EyesEnlarge", any, [](C &c) -> int64_t { return EyesEnlarge(c.a); }),
        no_slot(
            "alg_Img_Eradicate", any, [](C &c) -> int64_t { return alg_Img_Eradicate(c.a, c.p, c.p, c.p), 0; },
            kNoResult),
        no_slot(
            "alg_Img_EyesEnlarge", any,
            [](C &c) -> int64_t {
                alg_Img_EyesEnlarge_ellipse(c.a, c.p, 3, c.p);
                alg_Img_EyesEnlarge_circle(c.a, 3, c.p, c.p);
                return alg_Img_EyesEnlarge(c.a, c.p, c.p, c.p, c.p), 0;
            },
            kNoResult),
        no_slot(
            "alg_Img_EyesMoreContrast_ellipse", any,
            [](C &c) -> int64_t { return alg_Img_EyesMoreContrast_ellipse(c.a, c.p, 3, c.p, c.p), 0; }, kNoResult),
        no_slot(
            "alg_Img_quheiyanquan_ellipse", any,
            [](C &c) -> int64_t { return alg_Img_quheiyanquan_ellipse(c.a, c.p, c.p, c.p), 0; }, kNoResult),
    });
}

TEST(Hostile, RetouchScalars) {
    auto pic = good<Image>(9, 7, 24, 1), none = good<Image>(9, 7, 24, 2);
    none->record.bits = nullptr;
    Image *slot = nullptr, *p = &pic->record;
    EXPECT_EQ(PX_Mimic(p, 0, 0, &none->record, 0, 0, 3, 3, 3, 1, &slot) + alg_QuHeiYanQuan_1(p, nullptr, ys, 2, 3, 9) +
                  alg_QuHeiYanQuan_1(p, xs, nullptr, 2, 3, 9),
              0);
    EXPECT_EQ(slot, nullptr);
    BuildTable(nullptr, 0.5f);
    MakeMapping(nullptr, 0.1f, 0.9f);
    const PXPoint far[4] = {{INT_MIN, INT_MAX}, {INT_MAX, INT_MIN}, {INT_MIN, INT_MIN}, {INT_MAX, INT_MAX}};
    PXPoint pts[3];
    for (int32_t v : kExtremes) {
        int32_t values[4] = {v, 1, INT_MAX, 0};
        const PXPoint o = PointOnCubicBezier(nullptr, nullptr, float(v));
        EXPECT_TRUE(Sort_largelow(nullptr, v) == nullptr && Sort_largelow(values, std::min(v, 4)) == values &&
                    getpos(nullptr, v, v) == v && (o.x | o.y) == 0);
        ComputeBezier(far, v, nullptr);
        ComputeBezier(nullptr, v, pts);
        PointOnCubicBezier(pts + 2, far, float(v));
        ComputeBezier(far, std::min(v, 3), pts);
    }
    EXPECT_EQ(pts[0].x, INT_MIN);
}
