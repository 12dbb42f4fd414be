// The gray plane of the drawing effects (sketch, photocopy).
#pragma once

#include <cstdint>

#include "core/internal/view.hpp"

namespace pxfx {

// g gets drawing_gray (core/internal/pixel.hpp) of every pixel of src, rows
// of src.width bytes one after the other.
void drawing_gray_plane(const View &src, uint8_t *g);

} // namespace pxfx
