// The result-image rule shared by effects, deformations and the retouch and
// line tools that fill a caller's slot.
#pragma once

#include <pxfx/core.h>

namespace pxfx {

// Applies the rule to `*dst` for `src`:
//  - a null slot or a source without pixels: returns null, touches nothing;
//  - an image in the slot with the source's bit count, height and width (and
//    pixels) is reused as it stands;
//  - otherwise the slot's image is released and replaced by
//    malloc_Image(src width, src height, src bit count).
// Returns the slot's image, or null when it could not be made (slot null then).
Image *acquire_result(const Image *src, Image **dst);

} // namespace pxfx
