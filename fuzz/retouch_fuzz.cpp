// Fuzzes the portrait tools: skin masks and smoothing, tone curves and
// automatic levels, the brushes with centres and radii anywhere (cache slots
// of any shape and tag), Bezier helpers, rank helpers on caller arrays, and
// the eye and under-eye tools.
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

void slot_tools(Input &in, Image *src) {
    Slot out(in, src);
    switch (in.byte() % 12) {
    case 0: CreateFaceMaskImg(src, out.get()); break;
    case 1: SmileDetect(src, out.get(), in.i32()); break;
    case 2: alg_Img_smooth_1(src, out.get()); break;
    case 3: alg_Img_smooth(src, out.get()); break;
    case 4: alg_Img_Skin(src, out.get(), in.param(0, 1)); break;
    case 5: ImageAutoGradationProcess(src, out.get(), in.param(0, 100)); break;
    case 6: ImageAutoGradationProcess1(src, out.get(), in.i32(), in.param(0, 1)); break;
    case 7: ImageExposure(src, out.get(), in.param(-255, 255)); break;
    case 8: MyOneKeyFliter(src, out.get()); break;
    case 9: thresholdBlur(in.i32(), in.i32(), in.param(0, 9), in.param(0, 100), src, out.get()); break;
    case 10: MoreLight(src, in.param(-1, 25), out.get()); break;
    default: alg_Img_Blending(src, out.get()); break;
    }
}

void in_place(Input &in, Image *img) {
    const int32_t cx = in.param(-8, 72), cy = in.param(-8, 72);
    switch (in.byte() % 10) {
    case 0: LightUP(img); break;
    case 1: Best_Color(img, in.param(0, 25)); break;
    case 2: alg_Img_Eradicate(img, cx, cy, in.param(0, 40)); break;
    case 3: alg_Img_EyesEnlarge_ellipse(img, cx, cy, in.param(0, 40)); break;
    case 4: alg_Img_EyesEnlarge_circle(img, cx, cy, in.param(0, 40)); break;
    case 5: alg_Img_EyesEnlarge(img, cx, cy, in.param(0, 40), in.param(0, 1)); break;
    case 6: EyesEnlarge(img); break;
    case 7: alg_Img_EyesMoreContrast_ellipse(img, cx, cy, in.param(0, 40), in.param(-100, 200)); break;
    case 8: alg_Img_quheiyanquan_ellipse(img, cx, cy, in.param(0, 10)); break;
    default: {
        const size_t n = static_cast<size_t>(in.range(0, 6));
        std::vector<int32_t> xs = ints(in, n, -8, 72), ys = ints(in, n, -8, 72);
        const int32_t count = in.one_in(16) ? in.nonpositive() : static_cast<int32_t>(n);
        alg_QuHeiYanQuan_1(img, maybe_null(in, xs), maybe_null(in, ys), count, in.param(0, 30), in.param(0, 10));
        break;
    }
    }
}

void brushes(Input &in, Image *picture) {
    const int32_t cx = in.param(-8, 72), cy = in.param(-8, 72), r = in.param(0, 40);
    Slot cache(in, picture);
    switch (in.byte() % 6) {
    case 0: {
        ImageGuard src{make_partner(in, picture)};
        PointArea_Copy(picture, src.img, cx, cy, r);
        break;
    }
    case 1: {
        ImageGuard src{make_partner(in, picture)};
        PointArea_Copy_Alph(picture, src.img, cx, cy, r, in.param(0, 255));
        break;
    }
    case 2: {
        ImageGuard reference{in.one_in(2) ? make_partner(in, picture) : nullptr};
        PX_Mimic(picture, in.param(-8, 72), in.param(-8, 72), reference.img, in.param(-8, 72), in.param(-8, 72), cx, cy,
                 r, in.param(0, 1), cache.get());
        break;
    }
    case 3: {
        const PXTint tint{in.byte(), in.byte(), in.byte()};
        alg_Blending(picture, nullptr, cx, cy, tint, r, cache.get());
        break;
    }
    case 4: alg_smooth(picture, in.i32(), cx, cy, r, in.param(0, 100), cache.get()); break;
    default: alg_QuHeiYanQuan(picture, cx, cy, r, in.param(0, 10), cache.get(), in.param(0, 1)); break;
    }
    // A second dab reuses the cache the first one left.
    if (in.one_in(2)) alg_smooth(picture, 0, in.param(-8, 72), in.param(-8, 72), r, in.param(0, 100), cache.get());
}

void arrays(Input &in) {
    switch (in.byte() % 4) {
    case 0: {
        const size_t n = static_cast<size_t>(in.range(0, 40));
        std::vector<int32_t> v = ints(in, n, -300, 300);
        Sort_largelow(maybe_null(in, v), in.one_in(16) ? in.nonpositive() : static_cast<int32_t>(n));
        getpos(maybe_null(in, v), in.one_in(16) ? in.nonpositive() : static_cast<int32_t>(n), in.param(-300, 300));
        break;
    }
    case 1: {
        uint8_t table[256];
        BuildTable(in.one_in(16) ? nullptr : table, static_cast<float>(in.real(0.1, 4.0)));
        break;
    }
    case 2: {
        std::vector<int32_t> table = ints(in, 256, 0, 5000);
        MakeMapping(maybe_null(in, table), static_cast<float>(in.real(0, 0.1)), static_cast<float>(in.real(0, 1)));
        break;
    }
    default: {
        PXPoint controls[4];
        for (PXPoint &p : controls)
            p = {in.param(-100, 100), in.param(-100, 100)};
        PXPoint result;
        PointOnCubicBezier(in.one_in(8) ? nullptr : &result, in.one_in(16) ? nullptr : controls,
                           static_cast<float>(in.real(0, 1)));
        const int32_t n = in.one_in(16) ? in.nonpositive() : in.range(1, 64);
        std::vector<PXPoint> points(n > 0 ? static_cast<size_t>(n) : 1);
        ComputeBezier(in.one_in(16) ? nullptr : controls, n, maybe_null(in, points));
        break;
    }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    const uint32_t pick = in.byte() % 4;
    if (pick == 3) return arrays(in), 0;
    ImageGuard img{make_image(in)};
    Image *picture = in.one_in(32) ? nullptr : img.img;
    switch (pick) {
    case 0: slot_tools(in, picture); break;
    case 1: in_place(in, picture); break;
    default: brushes(in, picture); break;
    }
    return 0;
}
