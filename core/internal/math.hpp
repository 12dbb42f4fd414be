// Inline forms of the integer math helpers for per-pixel loops. The exported
// functions of core/math.cpp are thin wrappers over these.
#pragma once

#include <cmath>
#include <cstdint>
#include <limits>

namespace pxfx {

constexpr uint8_t clamp_u8(int32_t v) { return v > 255 ? 255 : (v < 0 ? 0 : static_cast<uint8_t>(v)); }

template <class T> constexpr T clamp_to(T v, T lo, T hi) { return v < lo ? lo : (v > hi ? hi : v); }

// A coordinate held to 0 .. n - 1 (n > 0), as the pixel readers clamp.
constexpr int32_t clamp_coord(int64_t v, int32_t n) { return v < 0 ? 0 : (v >= n ? n - 1 : static_cast<int32_t>(v)); }

// Floating-point value truncated toward zero into T, saturating at T's limits
// and giving 0 for NaN (what the ARM conversion instructions do), so that no
// conversion is undefined. Values whose truncation fits convert as a cast.
template <class T, class F> inline T trunc_sat(F v) {
    if (std::isnan(v)) return 0;
    constexpr F lo = static_cast<F>(std::numeric_limits<T>::min());
    constexpr F hi = static_cast<F>(std::numeric_limits<T>::max());
    if (v <= lo) return std::numeric_limits<T>::min();
    if (v >= hi) return std::numeric_limits<T>::max();
    return static_cast<T>(v);
}

// floor(s / a) for 2 <= a <= 129 and every s <= 255 a as a 16-bit
// multiply-high and a shift: floor(floor(s m / 2^16) / 2^p). With
// 2^p < a <= 2^(p+1), k = 16 + p and m = ceil(2^k / a) < 2^16, the error
// e = m a - 2^k is below a, so s m / 2^k = s / a + s e / (a 2^k) where
// s e <= 255 a (a - 1) < 2^15 a <= 2^k: the excess stays below 1 / a and
// cannot carry past the next multiple of 1 / a.
struct ByteSumDivisor {
    uint16_t m;
    int32_t p;
};
constexpr ByteSumDivisor byte_sum_divisor(uint32_t a) {
    int32_t p = 0;
    while ((2u << p) < a)
        ++p;
    return {static_cast<uint16_t>(((1u << (16 + p)) + a - 1) / a), p};
}

// floor(s / n) as a 64-bit multiply and shift: floor(s M / 2^32) with
// M = ceil(2^32 / n), for 1 <= n and s e < 2^32 where e = M n - 2^32 < n
// (every s <= 255 n while n < 4104, say). Then s M / 2^32 exceeds s / n by
// s e / (n 2^32) < 1 / n, which cannot reach the next integer.
struct ExactDivisor {
    uint64_t m;
    constexpr uint32_t divide(uint32_t s) const { return static_cast<uint32_t>((s * m) >> 32); }
};
constexpr ExactDivisor exact_divisor(uint32_t n) { return {((uint64_t{1} << 32) + n - 1) / n}; }

// Bit-by-bit square root over 32 bits, rounded to the nearest integer.
constexpr uint32_t isqrt_round(uint32_t x) {
    uint32_t root = 0;
    uint32_t rem = x;
    for (uint32_t bit = 1u << 30; bit != 0; bit >>= 2) {
        if (rem >= root + bit) {
            rem -= root + bit;
            root = (root >> 1) + bit;
        } else {
            root >>= 1;
        }
    }
    return rem > root ? root + 1 : root;
}

// Distance2D: the squared length formed modulo 2^32.
constexpr uint32_t distance2d(int32_t dx, int32_t dy) {
    const uint32_t ux = static_cast<uint32_t>(dx), uy = static_cast<uint32_t>(dy);
    return isqrt_round(ux * ux + uy * uy);
}

// round(sin(i degrees) * 100000) for i = 0..90.
inline constexpr int32_t kSinTable[91] = {
    0,     1745,  3490,  5234,  6976,  8716,  10453, 12187, 13917, 15643, 17365, 19081, 20791, 22495, 24192, 25882,
    27564, 29237, 30902, 32557, 34202, 35837, 37461, 39073, 40674, 42262, 43837, 45399, 46947, 48481, 50000, 51504,
    52992, 54464, 55919, 57358, 58779, 60182, 61566, 62932, 64279, 65606, 66913, 68200, 69466, 70711, 71934, 73135,
    74314, 75471, 76604, 77715, 78801, 79864, 80902, 81915, 82904, 83867, 84805, 85717, 86603, 87462, 88295, 89101,
    89879, 90631, 91355, 92050, 92718, 93358, 93969, 94552, 95106, 95630, 96126, 96593, 97030, 97437, 97815, 98163,
    98481, 98769, 99027, 99255, 99452, 99619, 99756, 99863, 99939, 99985, 100000};

constexpr int32_t table_sin(int32_t angle) {
    int32_t a = angle % 360;
    if (a < 0) a += 360;
    if (a <= 90) return kSinTable[a];
    if (a <= 180) return kSinTable[180 - a];
    if (a <= 270) return -kSinTable[a - 180];
    return -kSinTable[360 - a];
}

constexpr int32_t table_cos(int32_t angle) {
    int32_t a = angle % 360;
    if (a < 0) a += 360;
    if (a <= 90) return kSinTable[90 - a];
    if (a <= 180) return -kSinTable[a - 90];
    if (a <= 270) return -kSinTable[270 - a];
    return kSinTable[a - 270];
}

} // namespace pxfx
