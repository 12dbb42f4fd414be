// Channel planes: Split turns a picture into three 8-bit component planes (and
// an alpha plane) of one colour space, Combine joins them back into RGB. Both
// walk rows and run the conversion inline, specialised per format and mode.
#include <pxfx/color.h>

#include <cstring>
#include <initializer_list>
#include <optional>

#include "color/colorspace.hpp"
#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/vector_kernels.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;
using namespace pxfx::colour;

namespace {

// The planes of Split: three components and, with Alpha, the alpha plane.
struct PlaneViews {
    View p1, p2, p3, pa;
};

// Bytes per pixel of the formats whose rows have vector code; 0 for the
// others.
template <class F> constexpr int kVectorBytes = F::kBitCount == 24 || F::kBitCount == 32 ? F::kBitCount / 8 : 0;

template <class F, Mode M, bool Alpha> void split_rows(const View &src, const PlaneViews &p) {
    const int32_t w = src.width;
    // The vector copy converts each row but its last pixels (fewer than a
    // vector), which the plain loop finishes.
    vec::SplitPlanes vector = nullptr;
    if constexpr (kVectorBytes<F> != 0) vector = vec::split_planes(M, kVectorBytes<F>);
    for (int32_t y = 0; y < src.height; ++y) {
        const typename F::CRow in = F::crow(src, y);
        uint8_t *o1 = p.p1.row(y), *o2 = p.p2.row(y), *o3 = p.p3.row(y);
        uint8_t *oa = Alpha ? p.pa.row(y) : nullptr;
        int32_t x = 0;
        if constexpr (kVectorBytes<F> != 0)
            if (vector != nullptr) x = static_cast<int32_t>(vector(in, static_cast<size_t>(w), o1, o2, o3, oa));
        for (; x < w; ++x) {
            const uint32_t c = from_rgb<M>(F::load(in, x));
            o1[x] = static_cast<uint8_t>(c >> 16);
            o2[x] = static_cast<uint8_t>(c >> 8);
            o3[x] = static_cast<uint8_t>(c);
            if constexpr (Alpha) oa[x] = static_cast<uint8_t>(c >> 24);
        }
    }
}

// Releases the images held in the slots (each distinct image once) and
// clears the slots.
void release_slots(Image **const *slots, int n) {
    for (int i = 0; i < n; ++i) {
        Image *held = *slots[i];
        if (held == nullptr) continue;
        for (int j = i; j < n; ++j)
            if (*slots[j] == held) *slots[j] = nullptr;
        free_Image(&held, 0);
    }
}

// Row source of a plane for Combine: the plane's own row when it is an 8-bit
// record with pixels at least `width` wide, else the row read through
// GetPixelIndex (clamped; 0 for a plane without pixels) into a scratch row.
struct PlaneRows {
    std::optional<View> view;
    bool direct;
    uint8_t *scratch = nullptr;
    PlaneRows(const Image *plane, int32_t width)
        : view(view_of(plane)), direct(view && view->bitCount == 8 && view->width >= width) {}
    const uint8_t *row(int32_t y, int32_t width) const {
        if (direct) return view->row(y < view->height ? y : view->height - 1);
        if (!view) {
            std::memset(scratch, 0, static_cast<size_t>(width));
            return scratch;
        }
        for (int32_t x = 0; x < width; ++x)
            scratch[x] = GetPixelIndex(view->record, x, y);
        return scratch;
    }
};

template <Mode M, int Bpp>
void combine_rows(const View &out, const PlaneRows &r1, const PlaneRows &r2, const PlaneRows &r3, const PlaneRows *ra) {
    const int32_t w = out.width;
    const vec::CombinePlanes vector = vec::combine_planes(M, Bpp);
    for (int32_t y = 0; y < out.height; ++y) {
        const uint8_t *c1 = r1.row(y, w), *c2 = r2.row(y, w), *c3 = r3.row(y, w);
        const uint8_t *ca = Bpp == 4 ? ra->row(y, w) : nullptr;
        uint8_t *o = out.row(y);
        int32_t x = vector != nullptr ? static_cast<int32_t>(vector(c1, c2, c3, ca, static_cast<size_t>(w), o)) : 0;
        for (; x < w; ++x) {
            const uint32_t a = Bpp == 4 ? ca[x] : 0;
            const uint32_t c = to_rgb<M>(pack(c3[x], c2[x], c1[x], a));
            o[Bpp * x] = static_cast<uint8_t>(c);
            o[Bpp * x + 1] = static_cast<uint8_t>(c >> 8);
            o[Bpp * x + 2] = static_cast<uint8_t>(c >> 16);
            if constexpr (Bpp == 4) o[Bpp * x + 3] = static_cast<uint8_t>(c >> 24);
        }
    }
}

} // namespace

extern "C" {

int32_t Split(const Image *src, Image **plane1, Image **plane2, Image **plane3, Image **alphaPlane, int32_t mode) {
    if (src == nullptr || src->bits == nullptr || !rows_inside(src) || plane1 == nullptr || plane2 == nullptr ||
        plane3 == nullptr)
        return 0;
    if (plane1 == plane2 || plane1 == plane3 || plane2 == plane3) return 0;
    if (alphaPlane != nullptr && (alphaPlane == plane1 || alphaPlane == plane2 || alphaPlane == plane3)) return 0;
    const int32_t w = src->width, h = src->height;
    ImagePtr p1 = make_image(w, h, 8), p2 = make_image(w, h, 8), p3 = make_image(w, h, 8);
    Image **const planes[4] = {plane1, plane2, plane3, alphaPlane};
    if (!p1 || !p2 || !p3) {
        release_slots(planes, 3);
        return 0;
    }
    ImagePtr pa = alphaPlane != nullptr ? make_image(w, h, 8) : ImagePtr();
    // Planes of the source's size exist only for a source with pixels. Without
    // an alpha plane (or when it cannot be made) no alpha is written.
    const View from = *view_of(src);
    const PlaneViews p{*view_of(p1.get()), *view_of(p2.get()), *view_of(p3.get()), pa ? *view_of(pa.get()) : View{}};
    with_format(from.bitCount, [&](auto f) {
        with_mode(mode, [&](auto m) {
            if (pa)
                split_rows<decltype(f), decltype(m)::value, true>(from, p);
            else
                split_rows<decltype(f), decltype(m)::value, false>(from, p);
        });
    });
    // The old images go only now: a slot may hold the source itself.
    release_slots(planes, alphaPlane != nullptr ? 4 : 3);
    *plane1 = p1.release();
    *plane2 = p2.release();
    *plane3 = p3.release();
    if (alphaPlane != nullptr) *alphaPlane = pa.release();
    return 1;
}

Image *Combine(const Image *plane1, const Image *plane2, const Image *plane3, const Image *alphaPlane, int32_t mode) {
    // Planes are read as GetPixelIndex reads them: one without pixels as 0.
    if (plane1 == nullptr || plane2 == nullptr || plane3 == nullptr) return nullptr;
    for (const Image *p : {plane1, plane2, plane3, alphaPlane})
        if (p != nullptr && !rows_inside(p)) return nullptr;
    const int32_t w = plane1->width, h = plane1->height;
    if (plane2->width < w || plane3->width < w || plane2->height < h) return nullptr;
    PlaneRows r1(plane1, w), r2(plane2, w), r3(plane3, w);
    PlaneRows ra(alphaPlane != nullptr ? alphaPlane : plane1, w);
    PlaneRows *rows[4] = {&r1, &r2, &r3, alphaPlane != nullptr ? &ra : nullptr};
    Buffer<uint8_t> scratch;
    for (int i = 0; i < 4; ++i)
        if (rows[i] != nullptr && !rows[i]->direct) {
            if (!scratch) scratch = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), 4));
            if (!scratch) return nullptr;
            rows[i]->scratch = scratch.get() + static_cast<size_t>(i) * w;
        }
    Image *out = malloc_Image(w, h, alphaPlane != nullptr ? 32 : 24);
    if (out == nullptr) return nullptr;
    const View to = *view_of(out);
    with_mode(mode, [&](auto m) {
        if (alphaPlane != nullptr)
            combine_rows<decltype(m)::value, 4>(to, r1, r2, r3, &ra);
        else
            combine_rows<decltype(m)::value, 3>(to, r1, r2, r3, nullptr);
    });
    return out;
}

} // extern "C"
