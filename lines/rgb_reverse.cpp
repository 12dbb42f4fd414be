// Red and blue exchange of 24- and 32-bit pictures.
#include <pxfx/lines.h>

#include <utility>

#include "core/internal/image_check.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

extern "C" {

int32_t RGB_Reverse(Image *img) {
    // A record whose rows overrun its block is refused like one without a block.
    if (img == nullptr || img->bits == nullptr || !rows_inside(img)) return 0;
    // Other bit counts and empty sizes have no pixel to swap.
    if ((img->bitCount != 24 && img->bitCount != 32) || img->width <= 0 || img->height <= 0) return 1;
    const size_t step = img->bitCount / 8;
    const size_t bytes = static_cast<size_t>(img->width) * step;
    for (int32_t y = 0; y < img->height; ++y) {
        uint8_t *row = row_ptr(img, y);
        for (size_t i = 0; i < bytes; i += step)
            std::swap(row[i], row[i + 2]);
    }
    return 1;
}

} // extern "C"
