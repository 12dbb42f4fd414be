// How functions that fill a caller's slot (`Image **`) deliver their result.
// Each rule is named here once and used by name:
//  - reuse the slot (prepare_slot, acquire_result): effects, deformations
//    and the retouch tools;
//  - in place or slot (InPlaceOrSlot): the line tools, PX_IMG_Smooth and,
//    for a slot it requires, ImageExposure;
//  - hand over a new record (hand_over): the empty slot of in place or slot.
// The packed toolkit has no slots: its functions return a new PXImage
// (px_new, px_record in toolkit/pximage_check.hpp) or work in place on the
// caller's record.
#pragma once

#include <pxfx/core.h>

#include "core/internal/memory.hpp"
#include "core/internal/view.hpp"

namespace pxfx {

// ---- Reuse the slot ------------------------------------------------------

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

// acquire_result with the pixel work: fn(source view, result view) when the
// result has pixels (the source then has pixels of the same size and bit
// count). 0 when the call is refused, else 1: a result without pixels has
// nothing drawn into it.
template <class Fn> uint32_t draw_result(const Image *src, Image **dst, Fn &&fn) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    if (const std::optional<View> to = view_of(out)) fn(*view_of(src), *to);
    return 1;
}

// ---- Hand over a new record ----------------------------------------------

// The record made for the result becomes the slot's image; the caller owns it
// from then on. Whatever the slot held is not released.
inline void hand_over(Image **out, ImagePtr result) { *out = result.release(); }

// ---- In place or slot ----------------------------------------------------

// The result goes into the source itself when the slot pointer `out` is null,
// into a new record that becomes the slot's image when the slot is empty, and
// otherwise into the image the slot holds, by PX_Img_Copy (a converting copy
// when that image's size or bit count differ). An image in the slot is never
// released. The two members are the two moments a function can apply the
// rule: after making its result apart, or before working in place.
class InPlaceOrSlot {
  public:
    InPlaceOrSlot(Image *src, Image **out) : src_(src), out_(out) {}

    // A result made apart in a record of its own: copied into the source or
    // the slot's image (the record is then released), or, for an empty slot,
    // handed over. Always 1.
    int32_t deliver(ImagePtr result) const;

    // The record to work on in place, holding the source's pixels: the source
    // itself, the slot's image with the source copied in, or for an empty
    // slot a new record of the source's sizes and bit count, the source copied
    // in, put in the slot. Null when that new record cannot be made.
    Image *work_target();

    // After failed work on work_target(): a record it put in the empty slot is
    // released and the slot is empty again. The source or the slot's own image
    // keeps what the work left in it.
    void discard_new();

  private:
    Image *src_;
    Image **out_;
    bool made_ = false;
};

} // namespace pxfx
