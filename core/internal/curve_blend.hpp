// The blend of a level toward a tone curve's value that the curve tables of
// the filters are built with.
#pragma once

#include <cstdint>

namespace pxfx {

// Level v moved toward the curve value t by the weight w out of Scale:
// ((Scale - w) v + w t + 63) / Scale, low 8 bits kept. The sum wraps modulo
// 2^32 and the quotient truncates toward zero, as 32-bit signed arithmetic
// gives them, so weights outside 0 .. Scale give wrapped values rather than
// undefined ones.
template <int32_t Scale> constexpr uint8_t curve_blend(uint32_t v, uint32_t t, uint32_t w) {
    return static_cast<uint8_t>(static_cast<int32_t>((Scale - w) * v + w * t + 63) / Scale);
}

} // namespace pxfx
