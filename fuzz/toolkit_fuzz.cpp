// Fuzzes the packed-image toolkit on hand-made PXImage records of any bit
// count (blocks sized exactly width x height x bitcount / 8), with rectangles
// and points inside, across and far outside the picture, plus the plane
// helpers and the curve-table colour filters on Image records.
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

// A side for a new picture: small, not positive, or big enough that the
// block of any two such sides cannot be allocated.
void new_size(Input &in, int32_t &w, int32_t &h) {
    switch (in.byte() % 16) {
    case 0: w = in.nonpositive(); break;
    case 1: h = in.nonpositive(); break;
    case 2: w = h = INT_MAX; break;
    case 3: w = 70000, h = 70000; break;
    default: return;
    }
}

PXRect rect(Input &in, const PXImage *im) {
    const int32_t w = im != nullptr ? im->width : 64, h = im != nullptr ? im->height : 64;
    PXRect r;
    r.left = in.param(-4, w + 4);
    r.right = in.param(-4, w + 4);
    r.bottom = in.param(-4, h + 4);
    r.top = in.param(-4, h + 4);
    return r;
}

PXPoint point(Input &in, const PXImage *im) {
    const int32_t w = im != nullptr ? im->width : 64, h = im != nullptr ? im->height : 64;
    return PXPoint{in.param(-4, w + 4), in.param(-4, h + 4)};
}

std::vector<uint8_t> plane(Input &in, int32_t &w, int32_t &h) {
    w = in.range(1, 64);
    h = in.range(1, 64);
    std::vector<uint8_t> v(static_cast<size_t>(w) * static_cast<size_t>(h));
    fill(in, v.data(), v.size());
    // Sizes that are not positive go with the block as it is.
    if (in.one_in(16)) w = in.nonpositive();
    if (in.one_in(16)) h = in.nonpositive();
    return v;
}

void geometry(Input &in, PXImage *img) {
    switch (in.byte() % 9) {
    case 0: {
        int32_t w = in.range(1, 96), h = in.range(1, 96);
        new_size(in, w, h);
        PXImage_Free(PXImage_Resize(img, w, h));
        break;
    }
    case 1: {
        const PXRect r = rect(in, img);
        PXImage_Free(PXImage_Crop(img, in.one_in(16) ? nullptr : &r));
        break;
    }
    case 2: PXImage_Free(PXImage_Rotate90(img)); break;
    case 3: PXImage_Free(PXImage_Rotate180(img)); break;
    case 4: PXImage_Free(PXImage_Rotate270(img)); break;
    case 5: PXImage_Free(PXImage_ZoomIn(img)); break;
    case 6: PXImage_Free(PXImage_ZoomOut(img)); break;
    case 7: {
        PXImageGuard other{make_pximage(in)};
        PXImage_IsSameImage(img, in.one_in(4) ? img : other.img);
        break;
    }
    default: {
        Shape s = pick_shape(in);
        if (!in.one_in(8)) s.bitCount = 32;
        PXImageGuard dst{make_pximage(in, s)};
        const PXRect r = rect(in, img);
        PXImage_ROI_Zoom(img, dst.img, in.one_in(16) ? nullptr : &r, in.real(0.25, 4.0), in.param(-4, 68),
                         in.param(-4, 68));
        break;
    }
    }
}

void in_place(Input &in, PXImage *img) {
    switch (in.byte() % 11) {
    case 0: PXImage_AutoExposure(img); break;
    case 1: PXImage_AutoExposure_1(img); break;
    case 2: {
        const PXPoint pt = point(in, img);
        PXImage_AutoWhiteBalance(img, in.one_in(16) ? nullptr : &pt);
        break;
    }
    case 3: PXImage_BlueEnhancement(img); break;
    case 4: PXImage_GreenChannel(img); break;
    case 5: PXImage_Sharpen(img, in.param(1, 100)); break;
    case 6: PXImage_Smooth(img, in.param(0, 100)); break;
    case 7: PXImage_EdgeDetection(img); break;
    case 8: PXImage_GrayToBinarization(img); break;
    case 9: PXImage_Effect_Paint(img); break;
    default: {
        const PXRect r = rect(in, img);
        const PXPoint pt = point(in, img);
        PXImage_Stamp(img, &r, &pt);
        break;
    }
    }
}

void clip(Input &in) {
    PXImageGuard photo{make_pximage(in)};
    // The frame must be at least 718 x 564 at 24 bits to be used.
    Shape s = in.one_in(3) ? pick_shape(in) : Shape{718 + in.range(0, 2), 564 + in.range(0, 2), 24};
    if (in.one_in(8)) s.bitCount = pick_bit_count(in);
    PXImageGuard frame{make_pximage(in, s)};
    PXImage_Free(PXImage_Effect_Clip(photo.img, frame.img));
}

void planes(Input &in) {
    int32_t w, h;
    std::vector<uint8_t> src = plane(in, w, h);
    switch (in.byte() % 5) {
    case 0: ProbabilityDensityValue(maybe_null(in, src), w, h); break;
    case 1: EffectPaint_GrayRowData(maybe_null(in, src), w, h); break;
    case 2: EffectPaint_BlueRowData(maybe_null(in, src), w, h); break;
    default: {
        int32_t dw, dh;
        std::vector<uint8_t> dst = plane(in, dw, dh);
        if (in.one_in(2))
            DualLinearIntepol(maybe_null(in, src), w, h, maybe_null(in, dst), dw, dh);
        else
            DualLinearIntepol_KWB(maybe_null(in, src), w, h, maybe_null(in, dst), dw, dh,
                                  static_cast<float>(in.real(0.1, 4.0)));
        break;
    }
    }
}

void scalars(Input &in) {
    const size_t n = static_cast<size_t>(in.range(1, 64));
    std::vector<int32_t> values = ints(in, n, -100, 100);
    const int32_t first = in.range(0, static_cast<int32_t>(n) - 1);
    px_ShellSort(values.data(), first, in.range(first - 1, static_cast<int32_t>(n) - 1));
    px_sqrt(in.i32());
    const PXPoint pt{in.param(-4, 68), in.param(-4, 68)};
    const PXRect r = rect(in, nullptr);
    px_PtInRect(in.one_in(16) ? nullptr : &pt, in.one_in(16) ? nullptr : &r);
    volatile uint8_t t = ZANTOMOPI[in.byte()] ^ ZANTOFILTER[in.byte()] ^ ZANTOFILTERBK[in.byte()];
    (void)t;
}

void colour_filters(Input &in) {
    Shape s = pick_shape(in);
    const uint32_t kind = in.byte() % 4;
    if (!in.one_in(8)) s.bitCount = kind == 1 ? 24 : 8;
    ImageGuard img{make_image(in, s)};
    switch (kind) {
    case 0:
    case 1: {
        ImageGuard mask{in.one_in(2) ? make_plane(in) : nullptr};
        if (kind == 0)
            ColorFilter(img.img, in.u32(), mask.img);
        else
            ColorFilter24(img.img, in.u32(), mask.img);
        break;
    }
    case 2: ColorFilter1(img.img, in.param(0, 255)); break;
    default: ColorFilter_zanto(img.img, in.param(0, 255)); break;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    switch (in.byte() % 8) {
    case 0:
    case 1: {
        PXImageGuard img{make_pximage(in)};
        geometry(in, in.one_in(32) ? nullptr : img.img);
        break;
    }
    case 2:
    case 3: {
        PXImageGuard img{make_pximage(in)};
        in_place(in, in.one_in(32) ? nullptr : img.img);
        break;
    }
    case 4: clip(in); break;
    case 5: planes(in); break;
    case 6: scalars(in); break;
    default: colour_filters(in); break;
    }
    return 0;
}
