// Building blocks for the entries of the operation table: calling the
// library's shapes of function (result slot, in place, packed images) on one
// input picture and returning a new result picture.
#pragma once

#include <pxfx/pxfx.h>

#include <cstring>
#include <utility>

#include "operations.hpp"

namespace pxop::kit {

// f(src, &result, ...) returning 1 on success.
template <class Fn, class... A> Image *effect(Fn fn, const Image *in, A... a) {
    Image *out = nullptr;
    if (fn(const_cast<Image *>(in), &out, a...) != 1) {
        free_Image(&out, 0);
        return nullptr;
    }
    return out;
}

// A copy of `in` handed to change(Image*), which returns false on failure.
template <class Fn> Image *in_place(const Image *in, Fn &&change) {
    Image *out = convert_to(in, in->bitCount);
    if (out != nullptr && !change(out)) free_Image(&out, 0);
    return out;
}

// A coordinate at `percent` of a picture's width (or height).
inline int32_t at(const Image *in, double percent, bool across) {
    const int32_t n = across ? in->width : in->height;
    const int32_t v = saturate(percent * n / 100.0);
    return v >= n ? n - 1 : v;
}

// Packed copies of padded pictures and back.
PXImage *to_packed(const Image *in);
Image *from_packed(const PXImage *in);

// A packed operation returning a new packed picture.
template <class Fn> Image *packed_new(const Image *in, Fn &&make) {
    PXImage *src = to_packed(in);
    if (src == nullptr) return nullptr;
    PXImage *res = make(src);
    Image *out = res != nullptr ? from_packed(res) : nullptr;
    PXImage_Free(res);
    PXImage_Free(src);
    return out;
}

// A packed operation changing its picture in place; change() returns false on failure.
template <class Fn> Image *packed_in_place(const Image *in, Fn &&change) {
    PXImage *img = to_packed(in);
    if (img == nullptr) return nullptr;
    Image *out = change(img) ? from_packed(img) : nullptr;
    PXImage_Free(img);
    return out;
}

} // namespace pxop::kit
