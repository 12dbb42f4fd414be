// The kernels that have vector code, each as its copy for the chosen target
// (core/internal/cpu.hpp); null where the plain loops run. Every copy gives
// the same bytes as the plain loop it stands for.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pxfx::vec {

// Median of the 5 x 5 window of byte samples: rows[0..4] are the window's
// padded rows (2 * channels samples readable before and after), out[i] gets
// the median of sample i for i < n.
using Median5Row = void (*)(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out);

#ifdef PXFX_PORTABLE_ONLY
inline Median5Row median5_row() { return nullptr; }
#else
Median5Row median5_row();
#endif

} // namespace pxfx::vec
