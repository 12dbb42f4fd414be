// Result delivery shared by the line tools that build a new plane.
#include "lines/lines_internal.hpp"

namespace pxfx::lines {

int32_t deliver(Image *img, Image **out, ImagePtr result) {
    if (out == nullptr) {
        PX_Img_Copy(img, result.get());
    } else if (*out == nullptr) {
        *out = result.release();
    } else {
        PX_Img_Copy(*out, result.get());
    }
    return 1;
}

} // namespace pxfx::lines
