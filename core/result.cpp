// The result-image rule.
#include "core/internal/result.hpp"

#include "core/internal/image_check.hpp"

namespace pxfx {

Image *prepare_slot(const Image *src, Image **dst) {
    if (!rows_inside(src)) return nullptr;
    Image *cur = *dst;
    if (cur != nullptr && cur->bitCount == src->bitCount && cur->height == src->height && cur->width == src->width) {
        if (!rows_inside(cur)) return nullptr;
        return cur;
    }
    free_Image(dst, 0);
    *dst = malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount));
    return *dst;
}

Image *acquire_result(const Image *src, Image **dst) {
    if (dst == nullptr || src == nullptr || src->bits == nullptr) return nullptr;
    return prepare_slot(src, dst);
}

} // namespace pxfx
