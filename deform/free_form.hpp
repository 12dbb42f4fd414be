// Hole filling of the free-form warp, apart so that it can be exercised on
// hand-made masks.
#pragma once

#include <pxfx/core.h>

#include <cstdint>

namespace pxfx {

// Flags of the warp's per-pixel mask (width x height bytes, row after row).
inline constexpr uint8_t kSourcePoint = 1; // a control source point: not mapped forward
inline constexpr uint8_t kKnown = 2;       // the result pixel has received a value

// Fills, rows outer and columns inner, each pixel of dst not flagged kKnown
// from known pixels at most 5 away: by four surrounding pixels, else by the
// nearest pair left and right, else by the nearest pair above and below.
// Filled pixels are flagged at once; pixels without such neighbours keep
// their value. dst must be a record with pixels.
void fill_warp_holes(Image *dst, uint8_t *mask);

} // namespace pxfx
