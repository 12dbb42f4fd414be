// Table entries of the line-detection pipeline (8-bit luma planes).
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;
using kit::in_place;

void add_lines(std::vector<Operation> &t) {
    t.push_back({"straighten",
                 "RecognizeYUV",
                 "Lines",
                 "Straightens along the boundary and marks line bands",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(RecognizeYUV, in); }});
    t.push_back({"decode",
                 "ImgDecode",
                 "Lines",
                 "RecognizeYUV through its decoding entry point",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) {
                     Image *out = nullptr;
                     ImgDecode(const_cast<Image *>(in), &out);
                     return out;
                 }});
    t.push_back({"resample",
                 "MyResample2",
                 "Lines",
                 "Vertical resampling then straightening",
                 {{"factor", true, 2, 49, 2, "rows per source row"}},
                 kGray8,
                 [](const Image *in, const Args &a) { return MyResample2(const_cast<Image *>(in), a.i(0)); },
                 false});
    t.push_back({"bands",
                 "BinImg",
                 "Lines",
                 "Band thresholding and line marking",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(BinImg, in); }});
    t.push_back(
        {"detect-lines",
         "DetectLines",
         "Lines",
         "Marks line bands of a binarised plane",
         {},
         kGray8,
         [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return DetectLines(p) == 1; }); }});
    t.push_back(
        {"vertical-edges", "MyEdge", "Lines", "Vertical edge marker", {}, kGray8, [](const Image *in, const Args &) {
             return effect(MyEdge, in);
         }});
    t.push_back(
        {"cross-median", "MyFliter", "Lines", "Cross-shaped median", {}, kGray8, [](const Image *in, const Args &) {
             return effect(MyFliter, in);
         }});
    t.push_back({"median5", "MyFliter1", "Lines", "5 x 5 median", {}, kGray8, [](const Image *in, const Args &) {
                     return effect(MyFliter1, in);
                 }});
    t.push_back(
        {"swap-red-blue",
         "RGB_Reverse",
         "Lines",
         "Swaps the first and third byte of each pixel",
         {},
         kColour,
         [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return RGB_Reverse(p) == 1; }); }});
}

} // namespace pxop
