// Table entries of the portrait retouching tools. Brush positions are given in
// percent of the picture so the defaults suit any photo size.
#include <climits>

#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::at;
using kit::effect;
using kit::in_place;

namespace {

// A void tool filling a result slot; null when it left none.
template <class Fn> Image *slot_tool(const Image *in, Fn &&run) {
    Image *out = nullptr;
    run(const_cast<Image *>(in), &out);
    return out;
}

Param pos(const char *name, double def, bool across) {
    return {name, false, 0, 100, def, across ? "percent of the width" : "percent of the height"};
}

const Param kRadius = {"radius", true, 1, 2000, 30, "brush radius in pixels"};

using C = Call<Image>;

const std::vector<int32_t> kRgb = {24, 32};
// A source without a pixel block reads as 0: the tools preparing a slot from
// it work on it. Tools that always report 1 run no pixel loop on a source of
// no columns and leave no result.
const std::vector<Accepted> kNoPixels = {"null pixels"}, kNoColumns = {"null pixels", shaped("zero width", "null")};

// A tool filling a result slot from one picture of any bit count.
Contract<Image> slot_contract(std::function<int64_t(C &)> call, int64_t failure = 0,
                              std::vector<Accepted> accepts = kNoPixels, bool keeps = false) {
    return {.formats = kAnyBits,
            .call = std::move(call),
            .failure = failure,
            .keeps_result_on_failure = keeps,
            .accepts = std::move(accepts)};
}
// Tools changing their picture, with an optional slot or none.
Contract<Image> no_slot(std::vector<int32_t> formats, std::function<int64_t(C &)> call, int64_t failure = 0,
                        std::vector<Accepted> accepts = {}) {
    return {.formats = std::move(formats),
            .call = std::move(call),
            .failure = failure,
            .slot = false,
            .accepts = std::move(accepts)};
}
// Pastes of a second picture of any size and bit count; a source without a
// pixel block pastes nothing.
Contract<Image> paste(std::function<int64_t(C &)> call) {
    return {.formats = kAnyBits, .call = std::move(call), .pictures = 2, .slot = false, .accepts = [] {
                std::vector<Accepted> v = in_both(kPixelless);
                v.insert(v.end(), {"second: pitch below a row", "second: zero pitch"});
                for (Accepted &a : v)
                    a.reads_as_zeros = a.what != "second: null pixels";
                return v;
            }()};
}
const int32_t kStrokeX[] = {0, 4, -9, INT_MAX}, kStrokeY[] = {3, INT_MIN, 2, 6};

} // namespace

void add_retouch(std::vector<Operation> &t) {
    t.push_back({"skin-mask",
                 PXOP_FN(CreateFaceMaskImg),
                 "Skin",
                 "8-bit skin mask (green of skin pixels)",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) {
                     return slot_tool(in, [](Image *s, Image **d) { CreateFaceMaskImg(s, d); });
                 },
                 slot_contract([](C &c) { return CreateFaceMaskImg(c.a, c.slot); }, 0, {})});
    t.push_back(
        {"skin-mask-picture",
         PXOP_FN(SmileDetect),
         "Skin",
         "The skin mask in the picture's own format",
         {},
         kAllFormats,
         [](const Image *in, const Args &) { return slot_tool(in, [](Image *s, Image **d) { SmileDetect(s, d, 0); }); },
         [] {
             // Without a pixel block no mask is made: the slot keeps a new, white image.
             Contract<Image> c = slot_contract([](C &c) { return SmileDetect(c.a, c.slot, c.p); }, 1,
                                               {{"null pixels", 1, false}, shaped("zero width", "null")});
             c.falls_back_on_failure = true;
             return c;
         }()});
    t.push_back({"spot-lift",
                 PXOP_FN(alg_Img_smooth_1),
                 "Skin",
                 "Brightens small dark spots on the skin",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(alg_Img_smooth_1, in); },
                 slot_contract([](C &c) { return alg_Img_smooth_1(c.a, c.slot); }, 0, kNoPixels, true)});
    t.push_back({"skin-smooth",
                 PXOP_FN(alg_Img_smooth),
                 "Skin",
                 "Spot lifting and a brightening curve",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return slot_tool(in, alg_Img_smooth); },
                 slot_contract([](C &c) { return alg_Img_smooth(c.a, c.slot), 0; }, kNoResult, kNoPixels, true)});
    t.push_back({"skin",
                 PXOP_FN(alg_Img_Skin),
                 "Skin",
                 "Skin smoothing, brightening and a tone curve",
                 {{"lighten", true, 0, 1, 1, "1 brightens once more"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(alg_Img_Skin, in, a.i(0)); },
                 slot_contract([](C &c) { return alg_Img_Skin(c.a, c.slot, c.p); }, 1, kNoColumns, true)});
    t.push_back({"light-up",
                 PXOP_FN(LightUP),
                 "Skin",
                 "Mid-tones lifted by a fixed curve",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return LightUP(p) == 1; }); },
                 no_slot(
                     kAnyBits, [](C &c) -> int64_t { return LightUP(c.a); }, 0, kPixelless)});
    t.push_back({"third-largest",
                 PXOP_FN(Best_Color),
                 "Skin",
                 "Third-largest value of a window (8-bit)",
                 {{"size", true, 1, 25, 3, "window side"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return Best_Color(p, a.i(0)) == 1; });
                 },
                 no_slot(
                     {8}, [](C &c) -> int64_t { return Best_Color(c.a, c.p); }, 0, kEmptySizes)});
    t.push_back({"lift-specks",
                 PXOP_FN(MoreLight),
                 "Skin",
                 "Lifts dark specks by the window's largest value (8-bit)",
                 {{"size", true, 1, 15, 5, "window side"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return slot_tool(in, [&](Image *s, Image **d) { MoreLight(s, a.i(0), d); });
                 },
                 slot_contract([](C &c) { return MoreLight(c.a, c.p, c.slot), 0; }, kNoResult)});
    t.push_back({"auto-levels",
                 PXOP_FN(ImageAutoGradationProcess),
                 "Tone",
                 "Auto levels with a local screen",
                 {{"amount", true, 0, 100, 80, "blend of the corrected picture"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(ImageAutoGradationProcess, in, a.i(0)); },
                 slot_contract([](C &c) { return ImageAutoGradationProcess(c.a, c.slot, c.p); }, 1, kNoColumns)});
    t.push_back({"auto-levels-dark",
                 PXOP_FN(ImageAutoGradationProcess1),
                 "Tone",
                 "Auto levels of the darker half",
                 {{"gamma", true, 0, 1, 1, "1 adds a 5/6 gamma"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return slot_tool(in, [&](Image *s, Image **d) { ImageAutoGradationProcess1(s, d, 0, a.i(0)); });
                 },
                 slot_contract([](C &c) { return ImageAutoGradationProcess1(c.a, c.slot, c.p, c.p), 0; }, kNoResult)});
    t.push_back({"exposure",
                 PXOP_FN(ImageExposure),
                 "Tone",
                 "Adds to the HSL lightness",
                 {{"delta", true, -255, 255, 30, "lightness change"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(ImageExposure, in, a.i(0)); },
                 slot_contract([](C &c) { return ImageExposure(c.a, c.slot, c.p); }, 0, {})});
    t.push_back({"one-key",
                 PXOP_FN(MyOneKeyFliter),
                 "Tone",
                 "15 x 15 cross median (8-bit)",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(MyOneKeyFliter, in); },
                 [] {
                     Contract<Image> c = no_slot({8}, [](C &c) -> int64_t { return MyOneKeyFliter(c.a, c.slot); });
                     c.also = [](C &c) -> int64_t { return MyOneKeyFliter(c.a, nullptr); };
                     return c;
                 }()});
    t.push_back({"shadow-blur",
                 PXOP_FN(thresholdBlur),
                 "Tone",
                 "Blur of near-black values with a tone curve",
                 {{"size", true, 1, 10, 5, "blur radius"}, {"amount", true, 0, 100, 60, "curve strength"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return slot_tool(in, [&](Image *s, Image **d) { thresholdBlur(0, 0, a.i(0), a.i(1), s, d); });
                 },
                 slot_contract([](C &c) { return thresholdBlur(c.p, c.p, c.p, c.p, c.a, c.slot), 0; }, kNoResult)});
    t.push_back({"paste",
                 PXOP_FN(PointArea_Copy),
                 "Brushes",
                 "Soft round paste of the sketched picture",
                 {pos("x", 50, true), pos("y", 50, false), kRadius},
                 kGray8 | kColour,
                 [](const Image *in, const Args &a) {
                     Image *sketch = effect(PX_IMG_Sketch_1, in);
                     Image *out = in_place(in, [&](Image *p) {
                         return PointArea_Copy(p, sketch, at(in, a.values[0], true), at(in, a.values[1], false),
                                               a.i(2)) == 1;
                     });
                     free_Image(&sketch, 0);
                     return out;
                 },
                 paste([](C &c) -> int64_t { return PointArea_Copy(c.a, c.b, c.p, c.p, c.p); })});
    t.push_back({"paste-lighten",
                 PXOP_FN(PointArea_Copy_Alph),
                 "Brushes",
                 "Lighten-only paste of a brighter copy",
                 {pos("x", 50, true), pos("y", 50, false), kRadius, {"level", true, 0, 255, 30, "rim darkening"}},
                 kGray8 | kColour,
                 [](const Image *in, const Args &a) {
                     Image *bright = effect(PX_IMG_Light_Alter, in, 150u, 3u);
                     Image *out = in_place(in, [&](Image *p) {
                         return PointArea_Copy_Alph(p, bright, at(in, a.values[0], true), at(in, a.values[1], false),
                                                    a.i(2), a.i(3)) == 1;
                     });
                     free_Image(&bright, 0);
                     return out;
                 },
                 paste([](C &c) -> int64_t { return PointArea_Copy_Alph(c.a, c.b, c.p, c.p, c.p, c.p); })});
    t.push_back(
        {"clone",
         PXOP_FN(PX_Mimic),
         "Brushes",
         "Clone brush: paints a shifted copy",
         {pos("from-x", 30, true), pos("from-y", 30, false), pos("to-x", 60, true), pos("to-y", 60, false), kRadius},
         kAllFormats,
         [](const Image *in, const Args &a) {
             Image *cache = nullptr;
             const int32_t fx = at(in, a.values[0], true), fy = at(in, a.values[1], false);
             const int32_t tx = at(in, a.values[2], true), ty = at(in, a.values[3], false);
             Image *out = in_place(
                 in, [&](Image *p) { return PX_Mimic(p, fx, fy, nullptr, tx, ty, tx, ty, a.i(4), 1, &cache) == 1; });
             free_Image(&cache, 0);
             return out;
         },
         slot_contract([](C &c) { return PX_Mimic(c.a, c.p, c.p, nullptr, 0, 0, c.p, c.p, c.p, 1, c.slot); }, 0, {})});
    t.push_back({"tint-brush",
                 PXOP_FN(alg_Blending),
                 "Brushes",
                 "Paints a tinted copy",
                 {pos("x", 50, true),
                  pos("y", 50, false),
                  kRadius,
                  {"red", true, 0, 255, 210, "128 unchanged"},
                  {"green", true, 0, 255, 150, "128 unchanged"},
                  {"blue", true, 0, 255, 128, "128 unchanged"}},
                 kColour,
                 [](const Image *in, const Args &a) {
                     const PXTint tint = {uint8_t(a.i(3)), uint8_t(a.i(4)), uint8_t(a.i(5))};
                     return in_place(in, [&](Image *p) {
                         return alg_Blending(p, nullptr, at(in, a.values[0], true), at(in, a.values[1], false), tint,
                                             a.i(2), nullptr) == 1;
                     });
                 },
                 no_slot(kRgb, [](C &c) -> int64_t {
                     return alg_Blending(c.a, nullptr, c.p, c.p, {201, 90, 30}, c.p, c.slot);
                 })});
    t.push_back({"portrait-tint",
                 PXOP_FN(alg_Img_Blending),
                 "Brushes",
                 "Whole-picture portrait tint",
                 {},
                 kColour,
                 [](const Image *in, const Args &) { return effect(alg_Img_Blending, in); },
                 [] {
                     Contract<Image> c = no_slot(kRgb, [](C &c) -> int64_t { return alg_Img_Blending(c.a, c.slot); }, 0,
                                                 {"null pixels", "bit count 0", "bit count 1", "bit count 4",
                                                  "bit count 8", "bit count 12", "bit count 16", "bit count 48"});
                     c.keeps_result_on_failure = true, c.done = 0;
                     c.accepts.front().reads_as_zeros = false;
                     c.also = [](C &c) -> int64_t { return alg_Img_Blending(c.a, nullptr); };
                     return c;
                 }()});
    t.push_back({"smooth-brush",
                 PXOP_FN(alg_smooth),
                 "Brushes",
                 "Paints a box-smoothed copy",
                 {pos("x", 50, true), pos("y", 50, false), kRadius, {"strength", true, 1, 64, 9, "box size"}},
                 kColour,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) {
                         return alg_smooth(p, 0, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2), a.i(3),
                                           nullptr) == 1;
                     });
                 },
                 no_slot(kRgb, [](C &c) -> int64_t { return alg_smooth(c.a, 0, c.p, c.p, c.p, c.p, c.slot); })});
    t.push_back({"blemish",
                 PXOP_FN(alg_Img_Eradicate),
                 "Brushes",
                 "Pulls a disc toward its surroundings' colour",
                 {pos("x", 50, true), pos("y", 50, false), {"radius", true, 1, 200, 8, "disc radius"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) {
                         alg_Img_Eradicate(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2));
                         return true;
                     });
                 },
                 no_slot(
                     kAnyBits, [](C &c) -> int64_t { return alg_Img_Eradicate(c.a, c.p, c.p, c.p), 0; }, kNoResult)});
    t.push_back(
        {"eye-ellipse",
         PXOP_FN(alg_Img_EyesEnlarge_ellipse),
         "Eyes",
         "Enlarges an eye inside an ellipse",
         {pos("x", 42, true), pos("y", 28, false), {"axis", true, 1, 500, 24, "horizontal semi-axis"}},
         kAllFormats,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 alg_Img_EyesEnlarge_ellipse(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2));
                 return true;
             });
         },
         no_slot(
             kAnyBits, [](C &c) -> int64_t { return alg_Img_EyesEnlarge_ellipse(c.a, c.p, 3, c.p), 0; }, kNoResult)});
    t.push_back(
        {"eye-circle",
         PXOP_FN(alg_Img_EyesEnlarge_circle),
         "Eyes",
         "Enlarges an eye inside a circle",
         {pos("x", 42, true), pos("y", 28, false), {"radius", true, 1, 500, 20, "circle radius"}},
         kAllFormats,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 alg_Img_EyesEnlarge_circle(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2));
                 return true;
             });
         },
         no_slot(
             kAnyBits, [](C &c) -> int64_t { return alg_Img_EyesEnlarge_circle(c.a, 3, c.p, c.p), 0; }, kNoResult)});
    t.push_back(
        {"eye",
         PXOP_FN(alg_Img_EyesEnlarge),
         "Eyes",
         "Enlarges an eye (ellipse or circle)",
         {pos("x", 42, true),
          pos("y", 28, false),
          {"size", true, 1, 500, 22, "semi-axis or radius"},
          {"ellipse", true, 0, 1, 1, "1 ellipse, 0 circle"}},
         kAllFormats,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 alg_Img_EyesEnlarge(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2), a.i(3));
                 return true;
             });
         },
         no_slot(
             kAnyBits, [](C &c) -> int64_t { return alg_Img_EyesEnlarge(c.a, c.p, c.p, c.p, c.p), 0; }, kNoResult)});
    t.push_back(
        {"eyes-auto",
         PXOP_FN(EyesEnlarge),
         "Eyes",
         "Finds both eyes from the skin and enlarges them",
         {},
         kAllFormats,
         [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return EyesEnlarge(p) == 1; }); },
         no_slot(kAnyBits, [](C &c) -> int64_t { return EyesEnlarge(c.a); })});
    t.push_back(
        {"eye-contrast",
         PXOP_FN(alg_Img_EyesMoreContrast_ellipse),
         "Eyes",
         "Contrast boost inside an eye ellipse",
         {pos("x", 42, true),
          pos("y", 28, false),
          {"axis", true, 1, 500, 24, "horizontal semi-axis"},
          {"contrast", true, -100, 300, 40, "percent"}},
         kAllFormats,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 alg_Img_EyesMoreContrast_ellipse(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2),
                                                  a.i(3));
                 return true;
             });
         },
         no_slot(
             kAnyBits, [](C &c) -> int64_t { return alg_Img_EyesMoreContrast_ellipse(c.a, c.p, 3, c.p, c.p), 0; },
             kNoResult)});
    t.push_back({"dark-circles",
                 PXOP_FN(alg_Img_quheiyanquan_ellipse),
                 "Eyes",
                 "Lightens the crescent under an eye",
                 {pos("x", 42, true), pos("y", 28, false), {"strength", true, 0, 10, 10, "10 doubles the effect"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) {
                         alg_Img_quheiyanquan_ellipse(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2));
                         return true;
                     });
                 },
                 no_slot(
                     kAnyBits, [](C &c) -> int64_t { return alg_Img_quheiyanquan_ellipse(c.a, c.p, c.p, c.p), 0; },
                     kNoResult)});
    t.push_back({"lighten-brush",
                 PXOP_FN(alg_QuHeiYanQuan),
                 "Eyes",
                 "Lightening brush",
                 {pos("x", 42, true), pos("y", 33, false), kRadius, {"level", true, 0, 255, 40, "added brightness"}},
                 kColour,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) {
                         return alg_QuHeiYanQuan(p, at(in, a.values[0], true), at(in, a.values[1], false), a.i(2),
                                                 a.i(3), nullptr, 0) == 1;
                     });
                 },
                 no_slot(kRgb, [](C &c) -> int64_t { return alg_QuHeiYanQuan(c.a, c.p, c.p, c.p, c.p, c.slot, 1); })});
    t.push_back(
        {"lighten-stroke",
         PXOP_FN(alg_QuHeiYanQuan_1),
         "Eyes",
         "Lightening brush along three dabs",
         {pos("x", 42, true), pos("y", 33, false), kRadius, {"level", true, 0, 255, 40, "added brightness"}},
         kColour,
         [](const Image *in, const Args &a) {
             const int32_t x = at(in, a.values[0], true), y = at(in, a.values[1], false), r = a.i(2);
             const int32_t xs[3] = {saturate(double(x) - r), x, saturate(double(x) + r)};
             const int32_t ys[3] = {y, saturate(double(y) + r / 4), y};
             return in_place(in, [&](Image *p) { return alg_QuHeiYanQuan_1(p, xs, ys, 3, r, a.i(3)) == 1; });
         },
         no_slot(kRgb, [](C &c) -> int64_t { return alg_QuHeiYanQuan_1(c.a, kStrokeX, kStrokeY, 4, c.p, c.p); })});
}

} // namespace pxop
