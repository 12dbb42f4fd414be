// Hostile input for every toolkit function.
#include <climits>
#include <cmath>

#include "support/hostile.hpp"

using namespace pxtest::hostile;
using P = Call<PXImage>;

namespace {

// Entries for functions taking the parameter and one picture, returning a new
// record or changing the picture in place, or two pictures (no result slot).
Contract<PXImage> made(const char *name, std::vector<int32_t> formats, PXImage *(*f)(PXImage *, int32_t)) {
    return {name, formats, [f](P &c) { return (c.out = f(c.a, c.p)) != nullptr; }, 0, 1, {}, false};
}
template <class R>
Contract<R> in_place(const char *name, std::vector<int32_t> formats, int32_t (*f)(R *, int32_t), int64_t failure = 0) {
    return {name, formats, [f](Call<R> &c) -> int64_t { return f(c.a, c.p); }, failure, 1, {}, false};
}
Contract<PXImage> two(const char *name, std::vector<int32_t> formats, int32_t (*f)(PXImage *, PXImage *, int32_t)) {
    return {name, formats, [f](P &c) -> int64_t { return f(c.a, c.b, c.p); }, 0, 2, {}, false};
}

// The entry with the degenerate records it works on (what it makes of them is
// pinned by the family tests).
template <class R> Contract<R> accepting(Contract<R> c, std::vector<std::string> names) {
    c.accepts = std::move(names);
    return c;
}

// A rectangle and a point following the parameter, and the address of such a
// value for the duration of a call.
PXRect rect(int32_t p) { return {1, p, p, 0}; }
PXPoint point(int32_t p) { return {p, p}; }
template <class T> const T *ptr(const T &v) { return &v; }

const std::vector<int32_t> geo = {8, 16, 24}, every(std::begin(kBitCountsTried), std::end(kBitCountsTried));
// Records without pixel rows (and, where named, without data).
const std::vector<std::string> rowless = {"zero width", "negative height", "INT_MIN width"};
const std::vector<std::string> pixelless = {"null pixels", "zero width", "negative height", "INT_MIN width"};
const auto frame = good<PXImage>(720, 566, 24, 5);

} // namespace

TEST(Hostile, PackedImages) {
    check_contracts<PXImage>({
        accepting(made("PXImage_Resize", geo, [](auto a, int32_t p) { return PXImage_Resize(a, p, 3); }), pixelless),
        accepting(made("PXImage_Crop", geo, [](auto a, int32_t p) { return PXImage_Crop(a, ptr(rect(p))); }),
                  pixelless),
        made("PXImage_Rotate90", geo, [](auto a, int32_t) { return PXImage_Rotate90(a); }),
        made("PXImage_Rotate180", geo, [](auto a, int32_t) { return PXImage_Rotate180(a); }),
        made("PXImage_Rotate270", geo, [](auto a, int32_t) { return PXImage_Rotate270(a); }),
        made("PXImage_ZoomIn", geo, [](auto a, int32_t) { return PXImage_ZoomIn(a); }),
        accepting(made("PXImage_ZoomOut", geo, [](auto a, int32_t) { return PXImage_ZoomOut(a); }), {"null pixels"}),
        accepting(made("Clip photo", {8, 24}, [](auto a, int32_t) { return PXImage_Effect_Clip(a, &frame->record); }),
                  pixelless),
        accepting(two("PXImage_ROI_Zoom", {32},
                      [](auto a, auto b, int32_t p) { return PXImage_ROI_Zoom(a, b, ptr(rect(p)), p / 3.0, p, 1); }),
                  {"null pixels", "zero width", "negative height", "INT_MIN width", "second: null pixels",
                   "second: zero width", "second: negative height", "second: INT_MIN width"}),
        two("PXImage_IsSameImage", {8, 24, 32}, [](auto a, auto b, int32_t) { return PXImage_IsSameImage(a, b); }),
        accepting(
            in_place<PXImage>("PXImage_AutoExposure", geo, [](auto a, int32_t) { return PXImage_AutoExposure(a); }),
            rowless),
        accepting(
            in_place<PXImage>("PXImage_AutoExposure_1", geo, [](auto a, int32_t) { return PXImage_AutoExposure_1(a); }),
            rowless),
        in_place<PXImage>("PXImage_AutoWhiteBalance", {8, 24},
                          [](auto a, int32_t p) { return PXImage_AutoWhiteBalance(a, ptr(point(p))); }),
        accepting(in_place<PXImage>("PXImage_BlueEnhancement", geo,
                                    [](auto a, int32_t) { return PXImage_BlueEnhancement(a); }),
                  rowless),
        in_place<PXImage>("PXImage_GreenChannel", {24, 32}, [](auto a, int32_t) { return PXImage_GreenChannel(a); }),
        // The broken records have bit count 0, which these filters leave alone.
        accepting(in_place<PXImage>("PXImage_Sharpen", every, PXImage_Sharpen), rowless),
        accepting(in_place<PXImage>("PXImage_Smooth", every, PXImage_Smooth), rowless),
        accepting(
            in_place<PXImage>("PXImage_EdgeDetection", every, [](auto a, int32_t) { return PXImage_EdgeDetection(a); }),
            rowless),
        in_place<PXImage>("PXImage_GrayToBinarization", geo,
                          [](auto a, int32_t) { return PXImage_GrayToBinarization(a); }),
        in_place<PXImage>(
            "PXImage_Effect_Paint", {8, 24}, [](auto a, int32_t) { return PXImage_Effect_Paint(a); }, kNoResult),
    });
}

TEST(Hostile, CurveFilters) {
    check_contracts<Image>({
        accepting(in_place<Image>("ColorFilter", {8}, [](auto a, int32_t p) { return ColorFilter(a, p, nullptr); }),
                  rowless),
        accepting(
            in_place<Image>("ColorFilter24", {24}, [](auto a, int32_t p) { return ColorFilter24(a, p, nullptr); }),
            rowless),
        accepting(in_place<Image>("ColorFilter1", {8}, ColorFilter1), rowless),
        accepting(in_place<Image>("ColorFilter_zanto", {8}, ColorFilter_zanto), rowless),
    });
    // Masks without pixels or area select nothing; the others are refused.
    auto gray = good<Image>(9, 7, 8, 1), rgb = good<Image>(9, 7, 24, 2);
    const auto before = gray->snapshot(), rgbBefore = rgb->snapshot();
    for (auto &mask : broken<Image>({8})) {
        const int32_t want = std::count(pixelless.begin(), pixelless.end(), mask->what) ? 2 : 0;
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
        EXPECT_EQ(px_sqrt(v), v > 0 ? int32_t(std::sqrt(double(v))) : 0);
        px_ShellSort(nullptr, 0, v);
        px_ShellSort(values, 0, std::min(n, 3));
    }
}
