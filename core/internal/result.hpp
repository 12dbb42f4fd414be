// The result-image rule shared by effects, deformations and the retouch tools
// that fill a caller's slot.
#pragma once

#include <pxfx/core.h>

namespace pxfx {

// The output-slot rule for `*dst` and a record `src` (neither null):
//  - an image in the slot with the source's bit count, height and width is
//    reused as it stands, also when it has no pixels (writes to it are then
//    skipped, as the pixel writers skip them);
//  - otherwise the slot's image is released and replaced by
//    malloc_Image(src width, src height, src bit count), which is null for an
//    empty or negative size.
// A source whose rows its block cannot hold, or an image in the slot whose
// rows would be written past its block, is refused instead: null, nothing
// touched. Returns the slot's image, or null when the call must fail.
Image *prepare_slot(const Image *src, Image **dst);

// The effects' result-image rule: a null slot pointer or a source without
// pixels is refused (null, nothing touched); otherwise prepare_slot. The
// caller runs its pixel work only when the image returned has pixels
// (has_pixels): a reused image without pixels or an empty size gives success
// with nothing drawn.
Image *acquire_result(const Image *src, Image **dst);

} // namespace pxfx
