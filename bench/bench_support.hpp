// Shared picture setup for the benchmarks.
#pragma once

#include <pxfx/pxfx.h>

#include <benchmark/benchmark.h>

#include "tests/support/allocation_hook.hpp"
#include "core/internal/cpu.hpp"

#include <cstdint>
#include <cstring>
#include <random>

namespace pxbench {

// The vector target the kernels run (PXFX_CPU), in the report's context.
inline const bool kTargetRecorded = [] {
    benchmark::AddCustomContext("pxfx_target", pxfx::cpu::target_name());
    return true;
}();

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

// The bundled sample portrait (tests/data/portrait-128.bmp) scaled bilinearly
// to w x h at the given bit count; null when the file cannot be read.
inline Image *load_photo(int32_t bitCount, int32_t w = kWidth, int32_t h = kHeight) {
    int32_t size = 0;
    unsigned char *file = PX_ReadMemFile(PXFX_BENCH_DATA_DIR "/portrait-128.bmp", &size);
    if (file == nullptr) return nullptr;
    auto le32 = [&](int at) { return int32_t(file[at] | file[at + 1] << 8 | file[at + 2] << 16 | file[at + 3] << 24); };
    const int32_t fw = le32(18), fh = le32(22), offset = le32(10);
    PXImage packed = {fw, fh, 24, static_cast<uint8_t *>(PX_malloc(static_cast<size_t>(fw) * fh * 3))};
    const size_t pitch = (static_cast<size_t>(fw) * 3 + 3) & ~size_t{3};
    for (int32_t y = 0; y < fh && packed.data != nullptr; ++y)
        std::memcpy(packed.data + static_cast<size_t>(y) * fw * 3, file + offset + y * pitch,
                    static_cast<size_t>(fw) * 3);
    PX_ReleaseMemFile(file);
    PXImage *scaled = packed.data != nullptr ? PXImage_Resize(&packed, w, h) : nullptr;
    PX_free(packed.data);
    if (scaled == nullptr) return nullptr;
    Image *colour = malloc_Image(w, h, 24), *out = malloc_Image(w, h, bitCount);
    for (int32_t y = 0; y < h && colour != nullptr; ++y)
        std::memcpy(colour->bits + static_cast<size_t>(y) * colour->pitch,
                    scaled->data + static_cast<size_t>(y) * w * 3, static_cast<size_t>(w) * 3);
    PXImage_Free(scaled);
    if (colour != nullptr && out != nullptr) PX_Img_Copy(out, colour);
    free_Image(&colour, 0);
    return out;
}

// The synthetic picture (photo == 0) or the scaled sample photo (photo != 0).
inline Image *make_source(int32_t bitCount, int64_t photo, int32_t w = kWidth, int32_t h = kHeight) {
    return photo != 0 ? load_photo(bitCount, w, h) : make_picture(bitCount, w, h);
}

// Bytes of an Image's pixel block.
inline double block_bytes(const Image *im) { return im != nullptr ? static_cast<double>(im->pitch) * im->height : 0.0; }

// Runs `body` once per iteration and reports what the first call allocated
// through PX_malloc ("alloc_B"), beside the bytes of the input picture
// ("in_B") and of any result the call itself creates ("out_B"), so that the
// report can weigh working memory against the picture.
template <class Body> void timed(benchmark::State &state, double inBytes, double outBytes, Body body) {
    pxfx::alloc::reset_stats();
    bool first = true;
    uint64_t firstBytes = 0;
    for (auto _ : state) {
        body();
        if (first) {
            firstBytes = pxfx::alloc::stats().bytes;
            first = false;
        }
    }
    state.counters["alloc_B"] = static_cast<double>(firstBytes);
    state.counters["in_B"] = inBytes;
    state.counters["out_B"] = outBytes;
}

// Reports megapixels per second for a picture of w x h per iteration.
inline void set_rate(benchmark::State &state, int32_t w = kWidth, int32_t h = kHeight) {
    state.counters["MP/s"] =
        benchmark::Counter(static_cast<double>(w) * h / 1e6, benchmark::Counter::kIsIterationInvariantRate);
}

// The picture named by a benchmark's first two arguments: bits, photo.
inline Image *source_of(benchmark::State &state) {
    return make_source(static_cast<int32_t>(state.range(0)), state.range(1));
}

// Runs run(src, &dst) per iteration into a result slot that stays between
// iterations (so a reused slot image is measured), then releases both.
template <class Run> void into_slot(benchmark::State &state, Image *src, Run run) {
    Image *dst = nullptr;
    timed(state, block_bytes(src), block_bytes(src), [&] { benchmark::DoNotOptimize(run(src, &dst)); });
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}

} // namespace pxbench
