// Fuzzes the line tools: the straightening and band pipeline on planes wide
// enough to reach it, the rank and edge filters with every result delivery,
// and the histogram, label and interval helpers on caller arrays.
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

// Planes up to 160 x 128: the straightening needs at least 121 x 13.
Image *line_plane(Input &in) { return make_plane(in, 160, 128); }

void images(Input &in) {
    ImageGuard img{line_plane(in)};
    Image *plane = in.one_in(32) ? nullptr : img.img;
    Slot out(in, img.img);
    switch (in.byte() % 9) {
    case 0: RecognizeYUV(plane, out.get()); break;
    case 1: ImgDecode(plane, out.get()); break;
    case 2: {
        ImageGuard resampled{MyResample2(plane, in.param(2, 49))};
        break;
    }
    case 3: BinImg(plane, out.get()); break;
    case 4: DetectLines(plane); break;
    case 5: MyEdge(plane, out.get()); break;
    case 6: MyFliter(plane, out.get()); break;
    case 7: MyFliter1(plane, out.get()); break;
    default: RGB_Reverse(plane); break;
    }
}

void lists(Input &in) {
    switch (in.byte() % 4) {
    case 0: {
        std::vector<uint32_t> hist(256);
        for (uint32_t &h : hist)
            h = in.one_in(8) ? in.u32() : in.bits(1);
        GetMaxHtoThrod2(maybe_null(in, hist), in.one_in(2) ? 0 : in.param(0, 100000));
        break;
    }
    case 1: {
        const size_t n = static_cast<size_t>(in.range(0, 40));
        std::vector<int32_t> labels = ints(in, n, -2, 8);
        int32_t first = -1, last = -1;
        const int32_t count = in.one_in(16) ? in.nonpositive() : static_cast<int32_t>(n);
        CheckMaxSame(maybe_null(in, labels), count, in.one_in(8) ? nullptr : &first, in.one_in(8) ? nullptr : &last);
        break;
    }
    default: {
        // Interval lists hold n (start, end) pairs.
        const size_t n = static_cast<size_t>(in.range(0, 20));
        std::vector<int32_t> intervals = ints(in, 2 * n, -10, 300);
        const int32_t count = in.one_in(16) ? in.nonpositive() : static_cast<int32_t>(n);
        if (in.one_in(2)) {
            CombineMinSpace(maybe_null(in, intervals), count, in.param(0, 40));
        } else {
            int32_t start = in.param(-10, 300), end = in.param(-10, 300);
            CheckLapOver(maybe_null(in, intervals), count, in.one_in(16) ? nullptr : &start,
                         in.one_in(16) ? nullptr : &end);
        }
        break;
    }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    if (in.byte() % 3 == 0) {
        lists(in);
    } else {
        images(in);
    }
    ImgLineDecode();
    CheckAvailableBlock();
    RebuildImg();
    return 0;
}
