// Table entries of the packed-image toolkit and the curve-table colour filters.
#include <algorithm>

#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::in_place;
using kit::packed_in_place;
using kit::packed_new;

namespace {

constexpr uint32_t kPacked = kGray8 | kWord16 | kBgr24; // formats most toolkit operations take

// Largest result, in pixels, that the resizing entries make (256 megapixels).
constexpr int64_t kMaxResult = int64_t{1} << 28;

// A rectangle from percentages of the picture (bottom-up: top is the larger row).
PXRect rect_of(const PXImage *p, const Args &a, size_t first) {
    auto px = [&](size_t k, int32_t n) { return saturate(a.values[first + k] * (n - 1) / 100.0); };
    return {px(0, p->width), px(1, p->height), px(2, p->width), px(3, p->height)};
}

// A frame picture with a dark window where the photo shows through.
PXImage *make_frame() {
    auto *f = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    if (f == nullptr) return nullptr;
    f->width = 758;
    f->height = 604;
    f->bitcount = 24;
    f->data = static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(f->width) * f->height * 3));
    if (f->data == nullptr) {
        PX_free(f);
        return nullptr;
    }
    for (int32_t y = 0; y < f->height; ++y)
        for (int32_t x = 0; x < f->width; ++x) {
            uint8_t *p = f->data + (static_cast<size_t>(y) * f->width + x) * 3;
            const int32_t dx = x < 60 ? 60 - x : (x > 697 ? x - 697 : 0);
            const int32_t dy = y < 70 ? 70 - y : (y > 543 ? y - 543 : 0);
            const bool window = dx * dx + dy * dy < 400;
            p[0] = window ? 0 : static_cast<uint8_t>(150 + (x + y) % 60);
            p[1] = window ? 0 : 120;
            p[2] = window ? 0 : 90;
        }
    return f;
}

const std::vector<Param> kRectParams = {{"left", false, 0, 100, 15, "percent of the width"},
                                        {"top", false, 0, 100, 85, "percent of the height (the larger row)"},
                                        {"right", false, 0, 100, 70, "percent of the width"},
                                        {"bottom", false, 0, 100, 20, "percent of the height (the smaller row)"}};

using P = Call<PXImage>;

const std::vector<int32_t> kGeometry = {8, 16, 24};
// Every bit count, the broken records made at 8 bits. The filters need a
// scratch picture of width x height pixels, which empty sizes and one
// negative size do not get (refused); with both sizes negative nothing is
// computed (1).
const std::vector<int32_t> kEveryBits = {8, 0, 1, 4, 12, 16, 24, 32, 48};
const std::vector<Accepted> kFilterSizes = {"negative sizes"};
// At bit counts the filters leave alone (12, 32), pictures, also without
// pixel rows, are done and nothing is written; binarisation refuses those
// without rows.
const std::vector<Sized> kRowlessLeftAlone = {{0, 7, true, 1, "kept", 12},
                                              {-3, -2, true, 1, "kept", 12},
                                              {9, 7, true, 1, "kept", 32}},
                         kRowlessRefused = {{0, 7, true, 0, nullptr, 12}, {-3, -2, true, 0, nullptr, 12}};
// Records without pixel rows.
const std::vector<Accepted> kRowless = kEmptySizes;

// Contracts of functions taking the parameter and one picture, returning a
// new record or changing the picture in place, or two pictures (no result slot).
Contract<PXImage> made(std::vector<int32_t> formats, std::function<PXImage *(PXImage *, int32_t)> f,
                       std::vector<Accepted> accepts = {}, std::vector<Sized> sizes = {}) {
    return {.formats = std::move(formats),
            .call = [f](P &c) { return (c.out = f(c.a, c.p)) != nullptr; },
            .slot = false,
            .accepts = std::move(accepts),
            .sizes = std::move(sizes)};
}
template <class R>
Contract<R> changed(std::vector<int32_t> formats, std::function<int64_t(R *, int32_t)> f,
                    std::vector<Accepted> accepts = {}, int64_t failure = 0, std::vector<Sized> sizes = {}) {
    return {.formats = std::move(formats),
            .call = [f](Call<R> &c) { return f(c.a, c.p); },
            .failure = failure,
            .slot = false,
            .accepts = std::move(accepts),
            .sizes = std::move(sizes)};
}
Contract<PXImage> two(std::vector<int32_t> formats, std::function<int64_t(PXImage *, PXImage *, int32_t)> f,
                      std::vector<Accepted> accepts = {}) {
    return {.formats = std::move(formats),
            .call = [f](P &c) { return f(c.a, c.b, c.p); },
            .pictures = 2,
            .slot = false,
            .accepts = std::move(accepts)};
}

} // namespace

void add_toolkit(std::vector<Operation> &t) {
    t.push_back({"resize",
                 PXOP_FN(PXImage_Resize),
                 "Toolkit geometry",
                 "Bilinear resize (16-bit input gives 24-bit)",
                 {{"width", false, 5, 400, 150, "percent of the width"},
                  {"height", false, 5, 400, 150, "percent of the height"}},
                 kPacked,
                 [](const Image *in, const Args &a) {
                     const int32_t w = std::max(1, saturate(in->width * a.values[0] / 100));
                     const int32_t h = std::max(1, saturate(in->height * a.values[1] / 100));
                     if (static_cast<int64_t>(w) * h > kMaxResult) return static_cast<Image *>(nullptr);
                     return packed_new(in, [&](const PXImage *p) { return PXImage_Resize(p, w, h); });
                 },
                 // A source without pixel rows or data reads as zeros.
                 made(kGeometry, [](PXImage *a, int32_t p) { return PXImage_Resize(a, p, 3); },
                      {shaped("null pixels", "3x3x8 zeros"), shaped("zero width", "3x3x8 zeros"),
                       shaped("negative height", "3x3x8 zeros"), shaped("INT_MIN width", "3x3x8 zeros"),
                       shaped("negative sizes", "3x3x8 zeros")}),
                 false});
    t.push_back({"interpolate",
                 PXOP_FN(DualLinearIntepol_KWB),
                 "Toolkit geometry",
                 "Plane interpolation by one scale",
                 {{"scale", false, 0.25, 4, 1.5, "source coordinate = destination coordinate / scale"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     const int32_t w = std::max(1, saturate(in->width * a.values[0]));
                     const int32_t h = std::max(1, saturate(in->height * a.values[0]));
                     if (static_cast<int64_t>(w) * h > kMaxResult) return static_cast<Image *>(nullptr);
                     PXImage *src = kit::to_packed(in);
                     PXImage dst = {w, h, 8, static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(w) * h))};
                     Image *out = nullptr;
                     if (src != nullptr && dst.data != nullptr &&
                         DualLinearIntepol_KWB(src->data, in->width, in->height, dst.data, w, h, a.f(0)) == 1)
                         out = kit::from_packed(&dst);
                     PX_free(dst.data);
                     PXImage_Free(src);
                     return out;
                 },
                 {},
                 false});
    t.push_back({"crop", PXOP_FN(PXImage_Crop), "Toolkit geometry", "Copy of a rectangle, width rounded up to 8",
                 kRectParams, kPacked,
                 [](const Image *in, const Args &a) {
                     return packed_new(in, [&](const PXImage *p) {
                         const PXRect r = rect_of(p, a, 0);
                         return PXImage_Crop(p, &r);
                     });
                 },
                 // Width rounded up to 8; rows claimed above a negative height, none beyond no columns.
                 made(kGeometry, [](PXImage *a, int32_t p) { return PXImage_Crop(a, ptr(rect(p))); },
                      {shaped("null pixels", "8x4x8 zeros"), shaped("zero width", "0x4x8 none"),
                       shaped("negative height", "8x1x8 zeros"), shaped("INT_MIN width", "0x4x8 none"),
                       shaped("negative sizes", "0x1x8 none")}),
                 false});
    t.push_back({"rotate90",
                 PXOP_FN(PXImage_Rotate90),
                 "Toolkit geometry",
                 "Quarter turn",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) { return packed_new(in, PXImage_Rotate90); },
                 // Two negative sizes turn into a cleared block (none when its rounded width is 0).
                 made(kGeometry, [](PXImage *a, int32_t) { return PXImage_Rotate90(a); }, {},
                      {{-3, -9, true, 1, "-8x-3x8 zeros"}, {-3, -7, true, 0}}),
                 false});
    t.push_back({"rotate180",
                 PXOP_FN(PXImage_Rotate180),
                 "Toolkit geometry",
                 "Half turn",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) { return packed_new(in, PXImage_Rotate180); },
                 made(kGeometry, [](PXImage *a, int32_t) { return PXImage_Rotate180(a); },
                      {shaped("negative sizes", "-3x-2x8 zeros")})});
    t.push_back({"rotate270",
                 PXOP_FN(PXImage_Rotate270),
                 "Toolkit geometry",
                 "Three-quarter turn",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) { return packed_new(in, PXImage_Rotate270); },
                 made(kGeometry, [](PXImage *a, int32_t) { return PXImage_Rotate270(a); }, {},
                      {{-3, -9, true, 1, "-8x-3x8 zeros"}, {-3, -7, true, 0}}),
                 false});
    t.push_back({"zoom-in",
                 PXOP_FN(PXImage_ZoomIn),
                 "Toolkit geometry",
                 "2x enlargement",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) { return packed_new(in, PXImage_ZoomIn); },
                 made(kGeometry, [](PXImage *a, int32_t) { return PXImage_ZoomIn(a); },
                      {shaped("negative sizes", "-6x-4x8 zeros")}),
                 false});
    t.push_back({"zoom-out",
                 PXOP_FN(PXImage_ZoomOut),
                 "Toolkit geometry",
                 "2x reduction",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) { return packed_new(in, PXImage_ZoomOut); },
                 made(kGeometry, [](PXImage *a, int32_t) { return PXImage_ZoomOut(a); },
                      {shaped("null pixels", "8x3x8 zeros")}, {{-16, -2, true, 1, "-8x-1x8 zeros"}, {-4, -2, true, 0}}),
                 false});
    t.push_back({"roi-zoom",
                 PXOP_FN(PXImage_ROI_Zoom),
                 "Toolkit geometry",
                 "Scales a rectangle into the picture",
                 {{"left", false, 0, 100, 10, "percent of the width"},
                  {"top", false, 0, 100, 60, "percent of the height (the larger row)"},
                  {"right", false, 0, 100, 60, "percent of the width"},
                  {"bottom", false, 0, 100, 10, "percent of the height (the smaller row)"},
                  {"scale", false, 0.1, 10, 0.5, "scale factor"}},
                 kBgra32,
                 [](const Image *in, const Args &a) {
                     PXImage *src = kit::to_packed(in);
                     Image *out = packed_in_place(in, [&](PXImage *dst) {
                         const PXRect r = rect_of(dst, a, 0);
                         return src != nullptr && PXImage_ROI_Zoom(src, dst, &r, a.values[4], r.left, r.bottom) == 1;
                     });
                     PXImage_Free(src);
                     return out;
                 },
                 // Targets without data or pixel rows take no writes.
                 two(
                     {32},
                     [](PXImage *a, PXImage *b, int32_t p) -> int64_t {
                         return PXImage_ROI_Zoom(a, b, ptr(rect(p)), p / 3.0, p, 1);
                     },
                     [] {
                         std::vector<Accepted> v = in_both(kPixelless);
                         for (size_t i = kPixelless.size(); i < v.size(); ++i)
                             v[i].shape = "kept";
                         return v;
                     }())});
    t.push_back({"auto-exposure",
                 PXOP_FN(PXImage_AutoExposure),
                 "Toolkit tone",
                 "Percentile stretch with a 0.4 power curve",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_AutoExposure(p), true; });
                 },
                 changed<PXImage>(
                     kGeometry, [](PXImage *a, int32_t) { return PXImage_AutoExposure(a); }, kRowless)});
    t.push_back({"auto-exposure-fixed",
                 PXOP_FN(PXImage_AutoExposure_1),
                 "Toolkit tone",
                 "Fixed 0.4 power curve",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_AutoExposure_1(p), true; });
                 },
                 changed<PXImage>(
                     kGeometry, [](PXImage *a, int32_t) { return PXImage_AutoExposure_1(a); }, kRowless)});
    t.push_back(
        {"white-balance",
         PXOP_FN(PXImage_AutoWhiteBalance),
         "Toolkit tone",
         "White balance against a picked point",
         {{"x", false, 0, 100, 50, "percent of the width"}, {"y", false, 0, 100, 50, "percent of the height"}},
         kGray8 | kBgr24,
         [](const Image *in, const Args &a) {
             const PXPoint pt = {kit::at(in, a.values[0], true), kit::at(in, a.values[1], false)};
             return packed_in_place(in, [&](PXImage *p) { return PXImage_AutoWhiteBalance(p, &pt) == 1; });
         },
         changed<PXImage>({8, 24}, [](PXImage *a, int32_t p) { return PXImage_AutoWhiteBalance(a, ptr(point(p))); },
                          {"negative sizes"})});
    t.push_back({"invert",
                 PXOP_FN(PXImage_BlueEnhancement),
                 "Toolkit tone",
                 "Inverts 24-bit pictures",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_BlueEnhancement(p) == 1; });
                 },
                 changed<PXImage>(
                     kGeometry, [](PXImage *a, int32_t) { return PXImage_BlueEnhancement(a); }, kRowless)});
    t.push_back(
        {"green-gray",
         PXOP_FN(PXImage_GreenChannel),
         "Toolkit tone",
         "Green copied into every channel",
         {},
         kColour,
         [](const Image *in, const Args &) {
             return packed_in_place(in, [](PXImage *p) { return PXImage_GreenChannel(p) == 1; });
         },
         changed<PXImage>({24, 32}, [](PXImage *a, int32_t) { return PXImage_GreenChannel(a); }, {"negative sizes"})});
    t.push_back({"px-sharpen",
                 PXOP_FN(PXImage_Sharpen),
                 "Toolkit filters",
                 "Sharpening, kernel chosen by strength",
                 {{"strength", true, 1, 100, 30, "below 40 3x3, below 80 5x5, else 7x7"}},
                 kPacked,
                 [](const Image *in, const Args &a) {
                     return packed_in_place(in, [&](PXImage *p) { return PXImage_Sharpen(p, a.i(0)) == 1; });
                 },
                 changed<PXImage>(kEveryBits, PXImage_Sharpen, kFilterSizes, 0, kRowlessLeftAlone)});
    t.push_back({"px-smooth",
                 PXOP_FN(PXImage_Smooth),
                 "Toolkit filters",
                 "Mean or median smoothing by strength",
                 {{"strength", true, 1, 100, 70, "below 60 mean, else median"}},
                 kPacked,
                 [](const Image *in, const Args &a) {
                     return packed_in_place(in, [&](PXImage *p) { return PXImage_Smooth(p, a.i(0)) == 1; });
                 },
                 changed<PXImage>(kEveryBits, PXImage_Smooth, kFilterSizes, 0, kRowlessLeftAlone)});
    t.push_back({"edges",
                 PXOP_FN(PXImage_EdgeDetection),
                 "Toolkit filters",
                 "3 x 3 edge kernel",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_EdgeDetection(p) == 1; });
                 },
                 changed<PXImage>(
                     kEveryBits, [](PXImage *a, int32_t) { return PXImage_EdgeDetection(a); }, kFilterSizes, 0,
                     kRowlessLeftAlone)});
    t.push_back({"binarize",
                 PXOP_FN(PXImage_GrayToBinarization),
                 "Toolkit filters",
                 "Otsu binarisation",
                 {},
                 kPacked,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_GrayToBinarization(p) == 1; });
                 },
                 changed<PXImage>(
                     kGeometry, [](PXImage *a, int32_t) { return PXImage_GrayToBinarization(a); }, {"negative sizes"},
                     0, kRowlessRefused)});
    t.push_back({"frame",
                 PXOP_FN(PXImage_Effect_Clip),
                 "Toolkit filters",
                 "The photo shown through a frame's window",
                 {},
                 kGray8 | kBgr24,
                 [](const Image *in, const Args &) {
                     PXImage *frame = make_frame();
                     Image *out = packed_new(in, [&](const PXImage *p) { return PXImage_Effect_Clip(p, frame); });
                     PXImage_Free(frame);
                     return out;
                 },
                 made(
                     {8, 24},
                     [](PXImage *a, int32_t) {
                         static std::vector<uint8_t> block(size_t(720) * 566 * 3, 90);
                         static PXImage frame{720, 566, 24, block.data()};
                         return PXImage_Effect_Clip(a, &frame);
                     },
                     kPixelless),
                 false});
    t.push_back({"paint",
                 PXOP_FN(PXImage_Effect_Paint),
                 "Toolkit filters",
                 "Two-tone paint effect",
                 {},
                 kGray8 | kBgr24,
                 [](const Image *in, const Args &) {
                     return packed_in_place(in, [](PXImage *p) { return PXImage_Effect_Paint(p), true; });
                 },
                 changed<PXImage>(
                     {8, 24}, [](PXImage *a, int32_t) { return PXImage_Effect_Paint(a); }, {}, kNoResult)});
    t.push_back({"paint-gray-plane",
                 PXOP_FN(EffectPaint_GrayRowData),
                 "Toolkit filters",
                 "Gray-plane contrast stretch",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) {
                     return packed_in_place(
                         in, [](PXImage *p) { return EffectPaint_GrayRowData(p->data, p->width, p->height), true; });
                 }});
    t.push_back({"paint-blue-plane",
                 PXOP_FN(EffectPaint_BlueRowData),
                 "Toolkit filters",
                 "Blue-plane contrast stretch",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) {
                     return packed_in_place(
                         in, [](PXImage *p) { return EffectPaint_BlueRowData(p->data, p->width, p->height), true; });
                 }});
    t.push_back({"color-filter",
                 PXOP_FN(ColorFilter),
                 "Curve filters",
                 "Brightness shift by a colour's luminance",
                 {{"red", true, 0, 255, 230, ""}, {"green", true, 0, 255, 200, ""}, {"blue", true, 0, 255, 150, ""}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     const uint32_t c = uint32_t(a.i(0)) | uint32_t(a.i(1)) << 8 | uint32_t(a.i(2)) << 16;
                     return in_place(in, [&](Image *p) { return ColorFilter(p, c, nullptr) == 1; });
                 },
                 changed<Image>(
                     {8}, [](Image *a, int32_t p) { return ColorFilter(a, p, nullptr); }, kRowless)});
    t.push_back({"tint",
                 PXOP_FN(ColorFilter24),
                 "Curve filters",
                 "Tint 45/255 of the way toward a colour",
                 {{"red", true, 0, 255, 255, ""}, {"green", true, 0, 255, 140, ""}, {"blue", true, 0, 255, 40, ""}},
                 kBgr24,
                 [](const Image *in, const Args &a) {
                     const uint32_t c = uint32_t(a.i(0)) | uint32_t(a.i(1)) << 8 | uint32_t(a.i(2)) << 16;
                     return in_place(in, [&](Image *p) { return ColorFilter24(p, c, nullptr) == 1; });
                 },
                 changed<Image>(
                     {24}, [](Image *a, int32_t p) { return ColorFilter24(a, p, nullptr); }, kRowless)});
    t.push_back({"arc-curve",
                 PXOP_FN(ColorFilter1),
                 "Curve filters",
                 "Circular-arc tone curve (128 neutral, refused)",
                 {{"level", true, 0, 255, 190, "above 128 brightens, below darkens"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return ColorFilter1(p, a.i(0)) == 1; });
                 },
                 changed<Image>({8}, ColorFilter1, kRowless)});
    t.push_back({"zanto",
                 PXOP_FN(ColorFilter_zanto),
                 "Curve filters",
                 "Signature brightening or darkening curve",
                 {{"level", true, 0, 255, 200, "above 128 brightens, below darkens"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return ColorFilter_zanto(p, a.i(0)) == 1; });
                 },
                 changed<Image>({8}, ColorFilter_zanto, kRowless)});
    t.push_back(contract_row(
        PXOP_FN(PXImage_IsSameImage), "Toolkit geometry",
        two({8, 24, 32}, [](PXImage *a, PXImage *b, int32_t) -> int64_t { return PXImage_IsSameImage(a, b); })));
}

} // namespace pxop
