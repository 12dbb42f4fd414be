// The bilinear plane interpolation behind the resize family and the zoom of
// a rectangle.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pxfx::packed {

// Interpolates a packed srcWidth x srcHeight plane into dstWidth x
// dstHeight. Sample (row, column) of the source is src[row * srcWidth +
// column], of the destination dst[(row * dstWidth + column) * dstStride];
// destination index i reads source coordinate i / ry (rows) or i / rx
// (columns). False when working memory is missing.
bool interpolate_plane(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                       int32_t dstHeight, size_t dstStride, float ry, float rx);

} // namespace pxfx::packed
