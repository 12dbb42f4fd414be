// Integer math shared by effects, deformations and retouch tools.
#include <pxfx/core.h>

#include <cstdlib>

#include "core/internal/math.hpp"

using namespace pxfx;

extern "C" {

uint32_t xxgluSqrtFx(uint32_t x) { return isqrt_round(x); }

uint32_t Distance2D(int32_t dx, int32_t dy) { return distance2d(dx, dy); }

int32_t FastDistance2D(int32_t dx, int32_t dy) {
    // Magnitudes in unsigned arithmetic: |INT32_MIN| and large sums wrap
    // deterministically instead of overflowing.
    const uint32_t a = dx < 0 ? 0u - static_cast<uint32_t>(dx) : static_cast<uint32_t>(dx);
    const uint32_t b = dy < 0 ? 0u - static_cast<uint32_t>(dy) : static_cast<uint32_t>(dy);
    const uint32_t m = a < b ? a : b;
    return static_cast<int32_t>(a + b - (m >> 1) - (m >> 2) + (m >> 4));
}

int32_t tsin(int32_t angle) { return table_sin(angle); }

int32_t tcos(int32_t angle) { return table_cos(angle); }

int32_t tatan2(int32_t y, int32_t x) {
    if (x == 0) return y >= 0 ? 90 : 270;
    if (y == 0) return x > 0 ? 0 : 180;
    const uint32_t uy = static_cast<uint32_t>(y), ux = static_cast<uint32_t>(x);
    const uint32_t r = isqrt_round(uy * uy + ux * ux);
    if (r == 0) return 0;
    const uint32_t ay = y < 0 ? 0u - uy : uy;
    const int64_t s = (ay * 100000u) / r;
    int32_t k = 0;
    int64_t best = std::llabs(kSinTable[0] - s);
    for (int32_t i = 0; i <= 90; ++i) {
        if (kSinTable[i] == s) {
            k = i;
            break;
        }
        const int64_t diff = std::llabs(kSinTable[i] - s);
        if (diff < best) {
            best = diff;
            k = i;
        }
    }
    if (y > 0) return x > 0 ? k : 180 - k;
    return x < 0 ? 180 + k : 360 - k;
}

int32_t PX_rand(int32_t n) {
    int64_t r = lrand48();
    if (n != 0) r %= n;
    if ((lrand48() & 1) == 0) r = -r;
    return static_cast<int32_t>(r);
}

uint8_t ltouc(int32_t v) { return clamp_u8(v); }

} // extern "C"
