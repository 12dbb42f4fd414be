// Box smoothing entry point shared by Filter_fast and its tests.
#pragma once

#include <pxfx/core.h>

#include <cstdint>

namespace pxfx {

// Largest box size Filter_fast accepts: 255 * size^2 stays far inside 64 bits.
inline constexpr int32_t kMaxBoxSize = 1 << 20;

// Filter_fast; with runningSums false every box is summed in full (the path
// taken when the column sums cannot be allocated).
int32_t box_filter(Image *image, int32_t size, int32_t offset, bool runningSums);

} // namespace pxfx
