// PXImage helpers for the toolkit tests: owned records, seeded random
// pictures, and clamped sample reads written straight from the pixel layout.
#pragma once

#include <pxfx/pxfx.h>

#include "support/test_images.hpp"

namespace pxtest {

struct PXDeleter {
    void operator()(PXImage *im) const { PXImage_Free(im); }
};
using PX = std::unique_ptr<PXImage, PXDeleter>;

inline size_t px_size(const PXImage *im) { return size_t(im->width) * im->height * (im->bitcount / 8); }

inline PX px_make(int32_t w, int32_t h, int32_t bits, uint8_t fill = 0) {
    PX im(static_cast<PXImage *>(PX_malloc(sizeof(PXImage))));
    *im = {w, h, bits, static_cast<uint8_t *>(PX_malloc(size_t(w) * h * (bits / 8)))};
    std::memset(im->data, fill, px_size(im.get()));
    return im;
}

inline PX px_random(int32_t w, int32_t h, int32_t bits, uint32_t seed) {
    PX im = px_make(w, h, bits);
    std::mt19937 rng(seed);
    for (size_t i = 0; i < px_size(im.get()); ++i)
        im->data[i] = uint8_t(rng());
    return im;
}

inline PX px_clone(const PXImage *src) {
    PX im = px_make(src->width, src->height, src->bitcount);
    std::memcpy(im->data, src->data, px_size(src));
    return im;
}

inline std::vector<uint8_t> bytes(const PXImage *im) { return {im->data, im->data + px_size(im)}; }

inline int32_t clampi(int64_t v, int32_t n) { return v < 0 ? 0 : (v >= n ? n - 1 : int32_t(v)); }

// Sample c of the neighbour (y + dy, x + dx) as the toolkit filters read it:
// rows and columns clamped; 24-bit pictures clamp the byte index x*3 + dx*3
// and read on from there (bytes beyond the block read as 0); 16-bit samples
// are little-endian words.
inline int32_t neighbour(const PXImage *im, int32_t y, int32_t x, int32_t dy, int32_t dx, int32_t c) {
    const int32_t w = im->width, ry = clampi(y + dy, im->height);
    if (im->bitcount == 24) {
        const size_t k = size_t(ry) * w * 3 + clampi(int64_t(x) * 3 + dx * 3, w * 3) + c;
        return k < px_size(im) ? im->data[k] : 0;
    }
    const size_t p = size_t(ry) * w + clampi(x + dx, w);
    return im->bitcount == 16 ? im->data[2 * p] | im->data[2 * p + 1] << 8 : im->data[p];
}

inline void put_sample(PXImage *im, int32_t y, int32_t x, int32_t c, int32_t v) {
    const size_t p = size_t(y) * im->width + x;
    if (im->bitcount == 16) im->data[2 * p + 1] = uint8_t(v >> 8);
    im->data[im->bitcount == 16 ? 2 * p : p * (im->bitcount / 8) + c] = uint8_t(v);
}

} // namespace pxtest
