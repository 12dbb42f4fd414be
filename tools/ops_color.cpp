// Table entries of the colour spaces and generic filters.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;
using kit::in_place;

namespace {

constexpr uint32_t kFiltered = kGray8 | kColour; // formats the convolution writes

using C = Call<Image>;

// Functions without a result slot, or for which a null slot means "in place".
Contract<Image> no_slot(std::vector<int32_t> formats, std::function<int64_t(C &)> call) {
    return {.formats = std::move(formats), .call = std::move(call), .slot = false};
}
// A failed working allocation of the kernel filter leaves the prepared result
// in the slot; sources of an empty size draw nothing into a matching one.
Contract<Image> kernel_effect(int32_t (*fn)(const Image *, Image **)) {
    return {.formats = kAnyBits,
            .call = [fn](C &c) { return fn(c.a, c.slot); },
            .keeps_result_on_failure = true,
            .empty_sources = "1k 1k 1k 1k"};
}
// The plane shifts: nothing to visit in a plane of no rows.
Contract<Image> plane_shift(int32_t (*fn)(Image *, int32_t)) {
    Contract<Image> c = no_slot({8}, [fn](C &c) { return fn(c.a, c.p); });
    c.accepts = kEmptySizes;
    return c;
}

// A round trip through the planes of one colour space.
Image *planes_round_trip(const Image *in, int32_t mode) {
    Image *p1 = nullptr, *p2 = nullptr, *p3 = nullptr, *alpha = nullptr;
    if (Split(in, &p1, &p2, &p3, &alpha, mode) != 1) return nullptr;
    Image *out = Combine(p1, p2, p3, alpha, mode);
    for (Image **p : {&p1, &p2, &p3, &alpha})
        free_Image(p, 0);
    return out;
}

} // namespace

void add_color(std::vector<Operation> &t) {
    t.push_back({"hsl-shift",
                 PXOP_FN(PX_IMG_Transform),
                 "Colour",
                 "Shifts hue, saturation or lightness through HSL planes",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the picture unchanged"},
                  {"component", true, 0, 2, 0, "0 hue, 1 saturation, 2 lightness"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Transform, in, a.i(0), a.i(1)); },
                 Contract<Image>{.formats = kAnyBits,
                                 .call = [](C &c) { return PX_IMG_Transform(c.a, c.slot, c.p, c.p & 3); }}});
    t.push_back({"planes",
                 PXOP_FN(Split),
                 "Colour",
                 "Round trip through the planes of a colour space",
                 {{"mode", true, 0, 4, 1, "0 RGB, 1 HSL, 2 YUV, 3 YIQ, 4 XYZ"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return planes_round_trip(in, a.i(0)); },
                 Contract<Image>{.formats = kAnyBits, .call = [](C &c) {
                                     Image *p2 = nullptr, *p3 = nullptr, *alpha = nullptr;
                                     const int64_t r = Split(c.a, c.slot, &p2, &p3, &alpha, c.p);
                                     for (Image **p : {&p2, &p3, &alpha})
                                         free_Image(p, 0);
                                     return r;
                                 }}});
    t.push_back({"hue-plane",
                 PXOP_FN(BaseTran_Hue),
                 "Colour",
                 "Circular shift of an 8-bit plane (a hue plane)",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the plane unchanged"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return BaseTran_Hue(p, a.i(0)) == 1; });
                 },
                 plane_shift(BaseTran_Hue)});
    t.push_back({"level-plane",
                 PXOP_FN(BaseTran_LS),
                 "Colour",
                 "Clamped shift of an 8-bit plane (saturation, lightness)",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the plane unchanged"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return BaseTran_LS(p, a.i(0)) == 1; });
                 },
                 plane_shift(BaseTran_LS)});
    t.push_back({"blur",
                 PXOP_FN(PX_IMG_Blur),
                 "Filters",
                 "3 x 3 mean",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Blur, in); },
                 kernel_effect(PX_IMG_Blur)});
    t.push_back({"soften",
                 PXOP_FN(PX_IMG_Soften),
                 "Filters",
                 "3 x 3 soften, centre weight 8",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Soften, in); },
                 kernel_effect(PX_IMG_Soften)});
    t.push_back({"sharpen",
                 PXOP_FN(PX_IMG_Sharpen),
                 "Filters",
                 "3 x 3 sharpen, centre weight 15",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sharpen, in); },
                 kernel_effect(PX_IMG_Sharpen)});
    t.push_back({"emboss-gray",
                 PXOP_FN(PX_IMG_Emboss1),
                 "Filters",
                 "Gray diagonal relief around 127",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Emboss1, in); },
                 kernel_effect(PX_IMG_Emboss1)});
    t.push_back(
        {"convolve",
         PXOP_FN(Filter),
         "Filters",
         "Gaussian-like 3 x 3 kernel, optionally gray",
         {{"offset", true, -255, 255, 0, "added after the division"}, {"gray", true, 0, 1, 0, "1 writes gray output"}},
         kFiltered,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 static const int32_t kernel[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
                 return Filter(p, kernel, 3, 16, a.i(0), nullptr, nullptr, a.i(1)) == 1;
             });
         },
         no_slot(kAnyBits, [](C &c) {
             static const std::vector<int32_t> big(256 * 256, 1);
             return Filter(c.a, big.data(), c.p, c.p, c.p, nullptr, nullptr, c.p);
         })});
    t.push_back({"box-smooth",
                 PXOP_FN(PX_IMG_Smooth),
                 "Filters",
                 "Box smoothing by strength (box of strength / 10)",
                 {{"strength", true, 0, 100, 50, "0-3 copy, 10 per box pixel"}},
                 kFiltered,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Smooth, in, a.i(0)); },
                 Contract<Image>{.formats = kAnyBits,
                                 .call = [](C &c) { return PX_IMG_Smooth(c.a, c.slot, c.p); },
                                 .slot = false,
                                 .typical = 50,
                                 // The source is copied into the slot before smoothing.
                                 .empty_sources = "1c 1c 1k 1k"}});
    t.push_back({"box-filter",
                 PXOP_FN(Filter_fast),
                 "Filters",
                 "Box mean of any size plus an offset, in place",
                 {{"size", true, 1, 64, 7, "box side in pixels"}, {"offset", true, -255, 255, 0, "added to the mean"}},
                 kFiltered,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return Filter_fast(p, a.i(0), a.i(1)) == 1; });
                 },
                 no_slot({8, 12, 16, 24, 32, 48}, [](C &c) { return Filter_fast(c.a, c.p, c.p); })});
    t.push_back(contract_row(PXOP_FN(Combine), "Colour", [] {
        // Planes without pixels read as 0.
        Contract<Image> c =
            no_slot(kAnyBits, [](C &c) { return (c.out = Combine(c.a, c.b, c.b, c.b, c.p)) != nullptr; });
        c.pictures = 2, c.mismatch_fails = true, c.accepts = in_both({"null pixels"});
        return c;
    }()));
}

} // namespace pxop
