// Small per-byte channel operations: inversion of 24-bit images and the
// green channel copied into the colour bytes.
#include <pxfx/toolkit.h>

#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

extern "C" {

int32_t PXImage_BlueEnhancement(PXImage *img) {
    if (img == nullptr || img->data == nullptr || !px_rows_inside(img)) return 0;
    if (img->bitcount == 8 || img->bitcount == 16) return 1;
    if (img->bitcount != 24) return 0;
    // An image without pixel rows has no byte to invert.
    if (const std::optional<View> v = view_of(img)) {
        uint8_t *d = v->bits;
        const size_t n = v->block_bytes();
        for (size_t i = 0; i < n; ++i)
            d[i] = static_cast<uint8_t>(255 - d[i]);
    }
    return 1;
}

int32_t PXImage_GreenChannel(PXImage *img) {
    if (img == nullptr || img->data == nullptr || !px_rows_inside(img)) return 0;
    if (img->bitcount != 24 && img->bitcount != 32) return 0;
    const int32_t size = px_bytes(img->bitcount);
    // Without pixel rows: the scratch copy of the image's size gets no block
    // for a count of 0 or below (0). With both sizes negative it would, no
    // pixel is visited, and copying the unwritten scratch back is left out
    // (1, image unchanged).
    const std::optional<View> v = view_of(img);
    if (!v) return buffer_size_ok(block_size(img->width, img->height, size)) ? 1 : 0;
    const auto bpp = static_cast<size_t>(size);
    const size_t pixels = v->block_bytes() / bpp;
    uint8_t *p = v->bits;
    for (size_t i = 0; i < pixels; ++i, p += bpp)
        p[0] = p[2] = p[1];
    return 1;
}

} // extern "C"
