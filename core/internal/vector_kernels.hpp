// The kernels that have vector code, each as its copy for the chosen target
// (core/internal/cpu.hpp); null where the plain loops run. Every copy gives
// the same bytes as the plain loop it stands for.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/internal/byte_map.hpp"

namespace pxfx::vec {

// Median of the 5 x 5 window of byte samples: rows[0..4] are the window's
// padded rows (2 * channels samples readable before and after), out[i] gets
// the median of sample i for i < n.
using Median5Row = void (*)(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out);

// Byte-table maps of core/internal/byte_map.hpp over whole vectors: they map
// the first pixels, a multiple of the vector size, and return how many; the
// caller maps the rest.
using MapBytes = size_t (*)(const uint8_t *in, uint8_t *out, size_t pixels, const uint8_t *const *tables);
using ToneBytes = size_t (*)(const uint8_t *in, uint8_t *out, size_t pixels, const ToneTables &t);

// Convolution of byte samples with a kernel of size x size weights (size at
// most 7): out[i] = the sum of kernel[ky * size + kx] *
// rows[ky][i + (kx - size / 2) * channels], shifted right by `shift` and
// clamped to 0..255, for i < n; rows are the window's padded rows, out is none
// of them. The sums are held in 16 bits: 255 times the sum of the weights'
// magnitudes must stay below 32768. Rows shorter than a vector are left to
// the plain loop (false, nothing written).
using ConvolveBytes = bool (*)(const uint8_t *const *rows, const int32_t *kernel, int32_t size, int32_t channels,
                               size_t n, int32_t shift, uint8_t *out);

// Box sums of byte samples over a window of size x size (3, 5 or 7; channels
// 1 or 3): box(i) = the sum of rows[ky][i + (kx - size / 2) * channels] over
// the window, rows being the window's padded rows. For i < n, with `centre`
// 0 out[i] = box(i) / size^2, truncated; else out[i] = centre *
// rows[size / 2][i] - box(i) clamped to 0..255 (centre at most 128). out is
// none of the rows. Rows shorter than a vector are left to the plain loop
// (false, nothing written).
using WindowBoxBytes = bool (*)(const uint8_t *const *rows, int32_t size, int32_t channels, size_t n, int32_t centre,
                                uint8_t *out);

// One row of box means of byte samples, for boxes of size x size with size 2
// .. 11 (kMinBoxBytes .. kMaxBoxBytes). cols holds the 16-bit column sums of
// the row's boxes, `channels` interleaved, for the pixels -size / 2 ..
// width - 1 + size - 1 - size / 2; the n = width x channels sums of the
// pixels 0 .. width - 1 start at cols + size / 2 x channels and are the ones
// kept: when `in` is not null they first add the entering row's samples and
// subtract the leaving row `gone`'s, then the others repeat the edge pixels'.
// out[i] = the sum of the box of sample i divided by size^2, truncated, plus
// `offset`, clamped to 0..255. out may be `in` or `gone`.
using BoxBytes = void (*)(const uint8_t *in, const uint8_t *gone, uint16_t *cols, size_t n, int32_t size,
                          int32_t channels, int32_t offset, uint8_t *out);
inline constexpr int32_t kMinBoxBytes = 2, kMaxBoxBytes = 11;

#ifdef PXFX_PORTABLE_ONLY
inline Median5Row median5_row() { return nullptr; }
inline MapBytes map_bytes(int) { return nullptr; }
inline ToneBytes tone_bytes(int) { return nullptr; }
inline ConvolveBytes convolve_bytes() { return nullptr; }
inline WindowBoxBytes window_box_bytes() { return nullptr; }
inline BoxBytes box_bytes() { return nullptr; }
#else
Median5Row median5_row();
// For pixels of `channels` bytes (1, 3 or 4; 3 or 4 for the tone map).
MapBytes map_bytes(int channels);
ToneBytes tone_bytes(int channels);
ConvolveBytes convolve_bytes();
WindowBoxBytes window_box_bytes();
BoxBytes box_bytes();
#endif

} // namespace pxfx::vec
