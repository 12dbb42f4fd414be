// Shared picture setup for the benchmarks.
#pragma once

#include <pxfx/pxfx.h>

#include <benchmark/benchmark.h>

#include <cstdint>
#include <random>

namespace pxbench {

inline constexpr int32_t kWidth = 4000;
inline constexpr int32_t kHeight = 3000;

// A 4000 x 3000 picture of smooth gradients with noise, at the given bit count.
inline Image *make_picture(int32_t bitCount, int32_t w = kWidth, int32_t h = kHeight) {
    Image *im = malloc_Image(w, h, bitCount);
    std::mt19937 rng(42);
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *row = im->bits + static_cast<size_t>(y) * im->pitch;
        for (uint32_t i = 0; i < im->pitch; ++i)
            row[i] = static_cast<uint8_t>((i / 3 + y / 2) + (rng() >> 29));
    }
    return im;
}

// Reports megapixels per second for a picture of w x h per iteration.
inline void set_rate(benchmark::State &state, int32_t w = kWidth, int32_t h = kHeight) {
    state.counters["MP/s"] =
        benchmark::Counter(static_cast<double>(w) * h / 1e6, benchmark::Counter::kIsIterationInvariantRate);
}

} // namespace pxbench
