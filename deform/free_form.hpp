// Building blocks of the free-form warp, apart so that they can be exercised
// on their own: the per-row weights and the hole filling.
#pragma once

#include <cstdint>

#include "core/internal/view.hpp"

namespace pxfx {

// Flags of the warp's per-pixel mask (width x height bytes, row after row).
inline constexpr uint8_t kSourcePoint = 1; // a control source point: not mapped forward
inline constexpr uint8_t kKnown = 2;       // the result pixel has received a value

// Weights of image row y against the control source point (px, py) into
// wr[0 .. w - 1]: 1 / exp(log(d^2)) with d^2 the squared distance as an exact
// integer converted to double, and 0 on the point itself.
void warp_row_weights(double *wr, int32_t w, int32_t y, int32_t px, int32_t py);

// Fills, rows outer and columns inner, each pixel of dst not flagged kKnown
// from known pixels at most 5 away: by four surrounding pixels, else by the
// nearest pair left and right, else by the nearest pair above and below.
// Filled pixels are flagged at once; pixels without such neighbours keep
// their value.
void fill_warp_holes(const View &dst, uint8_t *mask);

} // namespace pxfx
