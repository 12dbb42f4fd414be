// Fuzzes the colour subsystem: the scalar colour-space conversions, Split and
// Combine on planes of mismatched sizes, the hue/lightness shifts, Filter with
// fuzzed kernels, masks and destinations, the fixed-kernel effects and the
// box smoothing.
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

void conversions(Input &in) {
    const uint32_t c = in.u32();
    RGBtoHSL(c);
    HSLtoRGB(c);
    HueToRGB(static_cast<uint16_t>(in.bits(2)), static_cast<uint16_t>(in.bits(2)), static_cast<uint16_t>(in.bits(2)));
    RGBtoYUV(c);
    YUVtoRGB(c);
    RGBtoYIQ(c);
    YIQtoRGB(c);
    RGBtoXYZ(c);
    XYZtoRGB(c);
    volatile float tap = matrixX[in.byte() % 10][in.byte() % 21];
    (void)tap;
}

void planes(Input &in) {
    ImageGuard src{make_image(in)};
    const int32_t mode = in.param(0, 5);
    Slot p1(in, src.img, false), p2(in, src.img, false), p3(in, src.img, false), alpha(in, src.img);
    // The first slot may hold the source itself; Split then releases it.
    if (in.one_in(8)) {
        p1.hold(src.img);
        src.img = nullptr;
    }
    Image **s1 = in.one_in(24) ? nullptr : p1.get();
    Split(src.img != nullptr ? src.img : p1.image(), s1, p2.get(), in.one_in(24) ? s1 : p3.get(), alpha.get(), mode);
    // Join the planes just made, or hand-made ones of other sizes.
    ImageGuard o1{in.one_in(3) ? make_plane(in) : nullptr};
    ImageGuard o2{in.one_in(3) ? make_partner(in, p1.image()) : nullptr};
    ImageGuard o3{in.one_in(3) ? make_plane(in) : nullptr};
    ImageGuard joined{Combine(o1.img ? o1.img : p1.image(), o2.img ? o2.img : p2.image(), o3.img ? o3.img : p3.image(),
                              in.one_in(3) ? o1.img : alpha.image(), in.param(0, 5))};
}

void shifts(Input &in) {
    switch (in.byte() % 3) {
    case 0: {
        ImageGuard plane{make_plane(in)};
        BaseTran_Hue(plane.img, in.param(0, 200));
        break;
    }
    case 1: {
        ImageGuard plane{make_plane(in)};
        BaseTran_LS(plane.img, in.param(0, 200));
        break;
    }
    default: {
        ImageGuard src{make_image(in)};
        Slot out(in, src.img);
        PX_IMG_Transform(src.img, out.get(), in.param(0, 200), in.param(0, 2));
        break;
    }
    }
}

void filter(Input &in) {
    ImageGuard src{make_image(in)};
    int32_t size = in.range(-1, 9);
    switch (in.byte() % 24) {
    case 0: size = INT_MIN; break;
    case 1: size = INT_MAX; break;
    case 2: size = 46341; break;
    default: break;
    }
    // Kernels hold size * size weights exactly; refused sizes get one weight.
    const size_t taps = size > 0 && size <= 9 ? static_cast<size_t>(size) * static_cast<size_t>(size) : 1;
    std::vector<int32_t> kernel = ints(in, taps, -16, 16);
    const int32_t divisor = in.param(-4, 64), offset = in.param(-128, 255);
    ImageGuard mask{in.one_in(3) ? make_plane(in) : nullptr};
    ImageGuard dst{in.one_in(2) ? make_partner(in, src.img) : nullptr};
    // Sometimes the destination is a second record over part of the source's block.
    Image alias = *src.img;
    Image *target = dst.img;
    if (target == nullptr && src.img->width > 0 && src.img->height > 0 && in.one_in(4)) {
        alias.width = in.range(1, src.img->width);
        alias.height = in.range(1, src.img->height);
        target = &alias;
    }
    Filter(src.img, maybe_null(in, kernel, 32), size, divisor, offset, mask.img, target, in.param(0, 1));
}

void kernels(Input &in) {
    ImageGuard src{make_image(in)};
    Slot out(in, src.img);
    switch (in.byte() % 4) {
    case 0: PX_IMG_Blur(src.img, out.get()); break;
    case 1: PX_IMG_Soften(src.img, out.get()); break;
    case 2: PX_IMG_Sharpen(src.img, out.get()); break;
    default: PX_IMG_Emboss1(src.img, out.get()); break;
    }
}

void smoothing(Input &in) {
    ImageGuard src{make_image(in)};
    if (in.one_in(2)) {
        int32_t size = in.param(1, 12);
        if (in.one_in(16)) size = (1 << 20) + in.range(-1, 1);
        Filter_fast(src.img, size, in.param(-64, 64));
    } else {
        Slot out(in, src.img);
        PX_IMG_Smooth(src.img, out.get(), in.param(0, 110));
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    switch (in.byte() % 6) {
    case 0: conversions(in); break;
    case 1: planes(in); break;
    case 2: shifts(in); break;
    case 3: filter(in); break;
    case 4: kernels(in); break;
    default: smoothing(in); break;
    }
    return 0;
}
