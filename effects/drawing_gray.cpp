// The gray plane of the drawing effects: whole vectors of 3- and 4-byte
// pixels through the chosen target's copy (effects/drawing_gray_vector.cpp),
// the rest in the plain loop.
#include "effects/drawing_gray.hpp"

#include "core/internal/pixel.hpp"
#include "core/internal/vector_kernels.hpp"

namespace pxfx {

void drawing_gray_plane(const View &src, uint8_t *g) {
    const uint32_t bits = src.bitCount;
    const vec::DrawingGray vector = bits == 24 || bits == 32 ? vec::drawing_gray(static_cast<int>(bits / 8)) : nullptr;
    with_format(bits, [&](auto f) {
        using F = decltype(f);
        const int32_t w = src.width;
        for (int32_t y = 0; y < src.height; ++y) {
            const typename F::CRow row = F::crow(src, y);
            uint8_t *out = g + static_cast<size_t>(y) * w;
            int32_t x = 0;
            if constexpr (F::kDirect)
                if (vector != nullptr) x = static_cast<int32_t>(vector(row, static_cast<size_t>(w), out));
            for (; x < w; ++x)
                out[x] = static_cast<uint8_t>(drawing_gray(F::load(row, x)));
        }
    });
}

} // namespace pxfx
