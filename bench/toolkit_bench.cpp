// Packed-image toolkit on a 12-megapixel picture at 8 and 24 bits.
#include <pxfx/toolkit.h>

#include <cstring>

#include "bench_support.hpp"

using namespace pxbench;

namespace {

// A packed copy of the synthetic picture or the sample photo.
PXImage *make_packed(int32_t bits, int64_t photo) {
    Image *im = make_source(bits, photo);
    auto *px = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    const size_t row = static_cast<size_t>(kWidth) * (bits / 8);
    *px = {kWidth, kHeight, bits, static_cast<uint8_t *>(PX_malloc(row * kHeight))};
    for (int32_t y = 0; y < kHeight; ++y)
        std::memcpy(px->data + y * row, im->bits + static_cast<size_t>(y) * im->pitch, row);
    free_Image(&im, 0);
    return px;
}

double packed_bytes(const PXImage *px) { return static_cast<double>(px->width) * px->height * (px->bitcount / 8); }

// Runs `op` on a fresh copy of the picture each iteration (the copy untimed).
template <class Op> void in_place(benchmark::State &state, Op op) {
    const auto bits = static_cast<int32_t>(state.range(0));
    PXImage *src = make_packed(bits, state.range(1));
    PXImage *work = make_packed(bits, state.range(1));
    const size_t bytes = static_cast<size_t>(kWidth) * kHeight * (bits / 8);
    timed(state, packed_bytes(src), 0, [&] {
        state.PauseTiming();
        std::memcpy(work->data, src->data, bytes);
        state.ResumeTiming();
        benchmark::DoNotOptimize(op(work));
    });
    set_rate(state);
    PXImage_Free(work);
    PXImage_Free(src);
}

// Runs an operation that returns a new picture of about `outScale` times the input's size.
template <class Op> void making(benchmark::State &state, double outScale, Op op) {
    PXImage *src = make_packed(static_cast<int32_t>(state.range(0)), state.range(1));
    timed(state, packed_bytes(src), packed_bytes(src) * outScale, [&] { PXImage_Free(op(src)); });
    set_rate(state);
    PXImage_Free(src);
}

void BM_ResizeHalf(benchmark::State &s) {
    making(s, 0.25, [](PXImage *p) { return PXImage_Resize(p, kWidth / 2, kHeight / 2); });
}
void BM_ResizeOneAndAHalf(benchmark::State &s) {
    making(s, 2.25, [](PXImage *p) { return PXImage_Resize(p, kWidth * 3 / 2, kHeight * 3 / 2); });
}
void BM_Rotate90(benchmark::State &s) { making(s, 1.0, PXImage_Rotate90); }
void BM_Rotate180(benchmark::State &s) { making(s, 1.0, PXImage_Rotate180); }
void BM_Rotate270(benchmark::State &s) { making(s, 1.0, PXImage_Rotate270); }
void BM_ZoomIn(benchmark::State &s) { making(s, 4.0, PXImage_ZoomIn); }
void BM_ZoomOut(benchmark::State &s) { making(s, 0.25, PXImage_ZoomOut); }
void BM_Sharpen(benchmark::State &s) {
    const auto strength = static_cast<int32_t>(s.range(2));
    in_place(s, [strength](PXImage *p) { return PXImage_Sharpen(p, strength); });
}
void BM_Smooth(benchmark::State &s) {
    const auto strength = static_cast<int32_t>(s.range(2));
    in_place(s, [strength](PXImage *p) { return PXImage_Smooth(p, strength); });
}
void BM_EdgeDetection(benchmark::State &s) { in_place(s, PXImage_EdgeDetection); }
void BM_Binarization(benchmark::State &s) { in_place(s, PXImage_GrayToBinarization); }
void BM_AutoExposure(benchmark::State &s) { in_place(s, PXImage_AutoExposure); }

} // namespace

#define PXFX_TOOLKIT_ARGS ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0}})->Unit(benchmark::kMillisecond)
BENCHMARK(BM_ResizeHalf)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_ResizeOneAndAHalf)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_Rotate90)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_Rotate180)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_Rotate270)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_ZoomIn)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_ZoomOut)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_Sharpen)
    ->ArgNames({"bits", "photo", "strength"})
    ->ArgsProduct({{8, 24}, {0}, {20, 60, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Smooth)
    ->ArgNames({"bits", "photo", "strength"})
    ->ArgsProduct({{8, 24}, {0}, {10, 30, 50}})
    ->ArgsProduct({{8, 24}, {0, 1}, {70, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_EdgeDetection)->PXFX_TOOLKIT_ARGS;
BENCHMARK(BM_Binarization)->ArgNames({"bits", "photo"})->ArgsProduct({{8, 24}, {0, 1}})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AutoExposure)->PXFX_TOOLKIT_ARGS;
