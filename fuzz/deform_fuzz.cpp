// Fuzzes the deformations' lists and maps: the wave with hand-made height
// maps and mismatched records, and the free-form warp with control pairs
// inside, outside and far off the picture (NaN and infinities included). The
// polar transforms are fuzzed through the registry (operations).
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

std::vector<DeformationPair> pairs(Input &in, const Image *im, size_t n) {
    const double w = im != nullptr ? im->width : 64, h = im != nullptr ? im->height : 64;
    std::vector<DeformationPair> v(n);
    for (DeformationPair &p : v)
        p = {in.real(-1, w), in.real(-1, h), in.real(-1, w), in.real(-1, h)};
    return v;
}

// A map of height rows of the width rounded up to 4 entries.
std::vector<int16_t> wave_map(Input &in, const Image *im) {
    const size_t w = im != nullptr && im->width > 0 ? static_cast<size_t>(im->width) : 1;
    const size_t h = im != nullptr && im->height > 0 ? static_cast<size_t>(im->height) : 1;
    std::vector<int16_t> map((w + 3) / 4 * 4 * h);
    for (int16_t &e : map)
        e = in.one_in(4) ? static_cast<int16_t>(in.bits(2)) : static_cast<int16_t>(in.range(-8, 8));
    return map;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    const uint32_t pick = in.byte() % 7;
    ImageGuard src{make_image(in)};
    Image *source = in.one_in(32) ? nullptr : src.img;
    switch (pick) {
    case 0: {
        const int32_t w = in.range(-1, 64), h = in.range(-1, 64);
        std::vector<int16_t> map(w > 0 && h > 0 ? static_cast<size_t>((w + 3) / 4 * 4 * h) : 1);
        create_wave(maybe_null(in, map), w, h, in.param(-8, 72), in.param(-8, 72), in.param(0, 40));
        break;
    }
    case 1: {
        ImageGuard dst{make_partner(in, src.img)};
        std::vector<int16_t> map = wave_map(in, src.img);
        render_wave(source, dst.img, maybe_null(in, map), in.i32(), in.i32());
        break;
    }
    case 2:
    case 3: {
        std::vector<DeformationPair> list = pairs(in, src.img, static_cast<size_t>(in.range(0, 6)));
        Slot out(in, src.img);
        DeformationImage(source, maybe_null(in, list, 32), static_cast<uint32_t>(list.size()), out.get());
        break;
    }
    case 4:
    case 5: {
        ImageGuard dst{make_partner(in, src.img)};
        std::vector<DeformationPair> list = pairs(in, src.img, static_cast<size_t>(in.range(0, 6)));
        const int32_t count = !in.one_in(16) ? static_cast<int32_t>(list.size()) : in.nonpositive();
        DeformationFunc(source, dst.img, count > 0 ? list.data() : maybe_null(in, list), count);
        break;
    }
    default: {
        const size_t n = static_cast<size_t>(in.range(0, 8));
        std::vector<int32_t> points = ints(in, 2 * n, -1000, 1000);
        std::vector<double> weights(n);
        for (double &w : weights)
            w = in.real(0, 10);
        WeightedCentroid(maybe_null(in, points), maybe_null(in, weights), static_cast<int32_t>(n));
        break;
    }
    }
    return 0;
}
