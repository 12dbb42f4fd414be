// The result-delivery rules.
#include "core/internal/result.hpp"

#include <utility>

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

int32_t InPlaceOrSlot::deliver(ImagePtr result) const {
    if (out_ == nullptr)
        PX_Img_Copy(src_, result.get());
    else if (*out_ == nullptr)
        hand_over(out_, std::move(result));
    else
        PX_Img_Copy(*out_, result.get());
    return 1;
}

Image *InPlaceOrSlot::work_target() {
    if (out_ == nullptr) return src_;
    if (*out_ == nullptr) {
        *out_ = malloc_Image(src_->width, src_->height, static_cast<int32_t>(src_->bitCount));
        if (*out_ == nullptr) return nullptr;
        made_ = true;
    }
    PX_Img_Copy(*out_, src_);
    return *out_;
}

void InPlaceOrSlot::discard_new() {
    if (made_) free_Image(out_, 0);
    made_ = false;
}

} // namespace pxfx
