// The result-image rule.
#include "core/internal/result.hpp"

#include "core/internal/image_check.hpp"

namespace pxfx {

Image *acquire_result(const Image *src, Image **dst) {
    if (dst == nullptr || !has_pixels(src)) return nullptr;
    Image *cur = *dst;
    if (cur != nullptr && cur->bitCount == src->bitCount && cur->height == src->height && cur->width == src->width &&
        has_pixels(cur))
        return cur;
    free_Image(dst, 0);
    *dst = malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount));
    return *dst;
}

} // namespace pxfx
