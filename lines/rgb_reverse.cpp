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
    const std::optional<View> v = view_of(img);
    if (!v || (v->bitCount != 24 && v->bitCount != 32)) return 1;
    const size_t step = v->bitCount / 8;
    const size_t bytes = static_cast<size_t>(v->width) * step;
    for (int32_t y = 0; y < v->height; ++y) {
        uint8_t *row = v->row(y);
        for (size_t i = 0; i < bytes; i += step)
            std::swap(row[i], row[i + 2]);
    }
    return 1;
}

} // extern "C"
