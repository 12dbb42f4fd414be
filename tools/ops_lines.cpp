// Table entries of the line-detection pipeline (8-bit luma planes).
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;
using kit::in_place;

namespace {

using C = Call<Image>;

// 8-bit planes only; a null result slot means "in place" where there is one.
Contract<Image> plane(std::function<int64_t(C &)> call, std::vector<Accepted> accepts = {}, int64_t failure = 0,
                      std::vector<Sized> sizes = {}) {
    return {.formats = {8},
            .call = std::move(call),
            .failure = failure,
            .slot = false,
            .accepts = std::move(accepts),
            .sizes = std::move(sizes)};
}

} // namespace

void add_lines(std::vector<Operation> &t) {
    t.push_back({"straighten",
                 PXOP_FN(RecognizeYUV),
                 "Lines",
                 "Straightens along the boundary and marks line bands",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(RecognizeYUV, in); },
                 // Planes smaller than its strips, or without pixels, are refused.
                 plane([](C &c) { return RecognizeYUV(c.a, c.slot); }, {}, 0,
                       {{120, 100, true, 0}, {200, 12, true, 0}, {200, 100, false, 0}})});
    t.push_back({"decode",
                 PXOP_FN(ImgDecode),
                 "Lines",
                 "RecognizeYUV through its decoding entry point",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) {
                     Image *out = nullptr;
                     ImgDecode(const_cast<Image *>(in), &out);
                     return out;
                 },
                 plane([](C &c) { return ImgDecode(c.a, c.slot), kNoResult; }, {}, kNoResult)});
    t.push_back({"resample",
                 PXOP_FN(MyResample2),
                 "Lines",
                 "Vertical resampling then straightening",
                 {{"factor", true, 2, 49, 2, "rows per source row"}},
                 kGray8,
                 [](const Image *in, const Args &a) { return MyResample2(const_cast<Image *>(in), a.i(0)); },
                 // One row without a block is a new white row; a taller record without one is refused.
                 plane([](C &c) { return (c.out = MyResample2(c.a, c.p)) != nullptr; }, {}, 0,
                       {{17, 1, false, 1, "17x1x8 white"}, {17, 2, false, 0}}),
                 false});
    t.push_back({"bands",
                 PXOP_FN(BinImg),
                 "Lines",
                 "Band thresholding and line marking",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(BinImg, in); },
                 [] {
                     // No columns: nothing to work on, and no result plane. Refused: a
                     // missing block with columns to read, no rows, and widths whose
                     // width - 10 overflows.
                     Contract<Image> c =
                         plane([](C &c) { return BinImg(c.a, c.slot); }, {shaped("zero width", "null")}, 0,
                               {{-5, 3, false, 1, "null"},
                                {INT32_MIN + 10, 7, true, 1, "null"},
                                {9, 0, true, 0},
                                {INT32_MIN + 9, 7, true, 0}});
                     c.falls_back_on_failure = true;
                     return c;
                 }()});
    t.push_back(
        {"detect-lines",
         PXOP_FN(DetectLines),
         "Lines",
         "Marks line bands of a binarised plane",
         {},
         kGray8,
         [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return DetectLines(p) == 1; }); },
         // One row, or 10 columns and fewer, leave nothing to mark. Refused: a
         // wider and taller record without pixels, no rows, and a width whose
         // width - 10 overflows.
         plane([](C &c) { return DetectLines(c.a); }, {"null pixels", shaped("zero width", "kept")}, 0,
               {{1, 1, true, 1, "kept"},
                {40, 1, true, 1, "kept"},
                {40, 1, false, 1},
                {10, 40, true, 1, "kept"},
                {-7, 7, true, 1, "kept"},
                {INT32_MIN + 10, 3, true, 1, "kept"},
                {11, 7, false, 0},
                {9, 0, true, 0},
                {INT32_MIN + 9, 3, true, 0}})});
    t.push_back({"vertical-edges",
                 PXOP_FN(MyEdge),
                 "Lines",
                 "Vertical edge marker",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(MyEdge, in); },
                 // A plane whose windows fit no column or row gets a new white one.
                 plane([](C &c) { return MyEdge(c.a, c.slot); }, {}, 0,
                       {{2, 9, false, 1, "2x9x8 white"}, {9, 2, true, 1, "9x2x8 white"}, {3, 3, false, 0}})});
    t.push_back({"cross-median",
                 PXOP_FN(MyFliter),
                 "Lines",
                 "Cross-shaped median",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(MyFliter, in); },
                 plane([](C &c) { return MyFliter(c.a, c.slot); }, {"null pixels"}, 0,
                       {{15, 1, true, 1, "15x1x8 white"},
                        {15, 30, false, 1, "15x30x8 white"},
                        {16, 4, true, 0},
                        {16, 6, true, 1, "16x6x8 white"},
                        {16, 9, false, 0}})});
    t.push_back({"median5",
                 PXOP_FN(MyFliter1),
                 "Lines",
                 "5 x 5 median",
                 {},
                 kGray8,
                 [](const Image *in, const Args &) { return effect(MyFliter1, in); },
                 plane([](C &c) { return MyFliter1(c.a, c.slot); }, {}, 0,
                       {{6, 2, true, 1, "6x2x8 white"},
                        {6, 9, false, 1, "6x9x8 white"},
                        {7, 4, true, 0},
                        {7, 6, true, 1, "7x6x8 white"},
                        {7, 9, false, 0}})});
    t.push_back(
        {"swap-red-blue",
         PXOP_FN(RGB_Reverse),
         "Lines",
         "Swaps the first and third byte of each pixel",
         {},
         kColour,
         [](const Image *in, const Args &) { return in_place(in, [](Image *p) { return RGB_Reverse(p) == 1; }); },
         Contract<Image>{.formats = kAnyBits,
                         .call = [](C &c) { return RGB_Reverse(c.a); },
                         .slot = false,
                         .accepts = {shaped("zero width", "kept"), shaped("negative height", "kept"),
                                     shaped("INT_MIN width", "kept"), shaped("negative sizes", "kept")},
                         .sizes = {{3, 0, true, 1, "kept"}}}});
}

} // namespace pxop
