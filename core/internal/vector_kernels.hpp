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

// The conversions of a colour mode of color/colorspace.hpp (from_rgb and
// to_rgb) over whole vectors of byte pixels, as the maps above: they convert
// the first pixels, a multiple of the vector size, and return how many.
// Split writes the three component planes and, when alpha is not null, the
// alpha plane (255 for 3-byte pixels); Combine reads the alpha plane for
// 4-byte pixels only.
using SplitPlanes = size_t (*)(const uint8_t *in, size_t pixels, uint8_t *p1, uint8_t *p2, uint8_t *p3, uint8_t *alpha);
using CombinePlanes = size_t (*)(const uint8_t *p1, const uint8_t *p2, const uint8_t *p3, const uint8_t *alpha,
                                 size_t pixels, uint8_t *out);

#ifdef PXFX_PORTABLE_ONLY
inline Median5Row median5_row() { return nullptr; }
inline MapBytes map_bytes(int) { return nullptr; }
inline ToneBytes tone_bytes(int) { return nullptr; }
inline SplitPlanes split_planes(int, int) { return nullptr; }
inline CombinePlanes combine_planes(int, int) { return nullptr; }
#else
Median5Row median5_row();
// For pixels of `channels` bytes (1, 3 or 4; 3 or 4 for the tone map).
MapBytes map_bytes(int channels);
ToneBytes tone_bytes(int channels);
// For a mode number and pixels of `channels` bytes (3 or 4); null for the
// modes without vector code (RGB, XYZ).
SplitPlanes split_planes(int mode, int channels);
CombinePlanes combine_planes(int mode, int channels);
#endif

} // namespace pxfx::vec
