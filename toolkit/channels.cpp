// Small per-byte channel operations: inversion of 24-bit images and the
// green channel copied into the colour bytes.
#include <pxfx/toolkit.h>

#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

extern "C" {

int32_t PXImage_BlueEnhancement(PXImage *img) {
    if (!px_usable(img)) return 0;
    if (img->bitcount == 8 || img->bitcount == 16) return 1;
    if (img->bitcount != 24) return 0;
    const size_t n = px_block(img);
    for (size_t i = 0; i < n; ++i)
        img->data[i] = static_cast<uint8_t>(255 - img->data[i]);
    return 1;
}

int32_t PXImage_GreenChannel(PXImage *img) {
    if (!px_usable(img) || (img->bitcount != 24 && img->bitcount != 32)) return 0;
    const size_t bpp = static_cast<size_t>(px_bytes(img->bitcount));
    const size_t pixels = px_block(img) / bpp;
    uint8_t *p = img->data;
    for (size_t i = 0; i < pixels; ++i, p += bpp)
        p[0] = p[2] = p[1];
    return 1;
}

} // extern "C"
