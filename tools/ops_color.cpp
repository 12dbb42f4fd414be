// Table entries of the colour spaces and generic filters.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;
using kit::in_place;

namespace {

constexpr uint32_t kFiltered = kGray8 | kColour; // formats the convolution writes

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
                 "PX_IMG_Transform",
                 "Colour",
                 "Shifts hue, saturation or lightness through HSL planes",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the picture unchanged"},
                  {"component", true, 0, 2, 0, "0 hue, 1 saturation, 2 lightness"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Transform, in, a.i(0), a.i(1)); }});
    t.push_back({"planes",
                 "Split + Combine",
                 "Colour",
                 "Round trip through the planes of a colour space",
                 {{"mode", true, 0, 4, 1, "0 RGB, 1 HSL, 2 YUV, 3 YIQ, 4 XYZ"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return planes_round_trip(in, a.i(0)); }});
    t.push_back({"hue-plane",
                 "BaseTran_Hue",
                 "Colour",
                 "Circular shift of an 8-bit plane (a hue plane)",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the plane unchanged"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return BaseTran_Hue(p, a.i(0)) == 1; });
                 }});
    t.push_back({"level-plane",
                 "BaseTran_LS",
                 "Colour",
                 "Clamped shift of an 8-bit plane (saturation, lightness)",
                 {{"amount", true, 0, 200, 150, "slider position, 100 leaves the plane unchanged"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return BaseTran_LS(p, a.i(0)) == 1; });
                 }});
    t.push_back({"blur", "PX_IMG_Blur", "Filters", "3 x 3 mean", {}, kFiltered, [](const Image *in, const Args &) {
                     return effect(PX_IMG_Blur, in);
                 }});
    t.push_back({"soften",
                 "PX_IMG_Soften",
                 "Filters",
                 "3 x 3 soften, centre weight 8",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Soften, in); }});
    t.push_back({"sharpen",
                 "PX_IMG_Sharpen",
                 "Filters",
                 "3 x 3 sharpen, centre weight 15",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sharpen, in); }});
    t.push_back({"emboss-gray",
                 "PX_IMG_Emboss1",
                 "Filters",
                 "Gray diagonal relief around 127",
                 {},
                 kFiltered,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Emboss1, in); }});
    t.push_back(
        {"convolve",
         "Filter",
         "Filters",
         "Gaussian-like 3 x 3 kernel, optionally gray",
         {{"offset", true, -255, 255, 0, "added after the division"}, {"gray", true, 0, 1, 0, "1 writes gray output"}},
         kFiltered,
         [](const Image *in, const Args &a) {
             return in_place(in, [&](Image *p) {
                 static const int32_t kernel[9] = {1, 2, 1, 2, 4, 2, 1, 2, 1};
                 return Filter(p, kernel, 3, 16, a.i(0), nullptr, nullptr, a.i(1)) == 1;
             });
         }});
    t.push_back({"box-smooth",
                 "PX_IMG_Smooth",
                 "Filters",
                 "Box smoothing by strength (box of strength / 10)",
                 {{"strength", true, 0, 100, 50, "0-3 copy, 10 per box pixel"}},
                 kFiltered,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Smooth, in, a.i(0)); }});
    t.push_back({"box-filter",
                 "Filter_fast",
                 "Filters",
                 "Box mean of any size plus an offset, in place",
                 {{"size", true, 1, 64, 7, "box side in pixels"}, {"offset", true, -255, 255, 0, "added to the mean"}},
                 kFiltered,
                 [](const Image *in, const Args &a) {
                     return in_place(in, [&](Image *p) { return Filter_fast(p, a.i(0), a.i(1)) == 1; });
                 }});
}

} // namespace pxop
