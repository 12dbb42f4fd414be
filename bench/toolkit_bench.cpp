// Packed-image toolkit on a 12-megapixel picture at 8 and 24 bits.
#include <pxfx/toolkit.h>

#include <cstring>

#include "bench_support.hpp"

using namespace pxbench;

namespace {

// A packed copy of the shared test picture.
PXImage *make_packed(int32_t bits) {
    Image *im = make_picture(bits);
    auto *px = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    const size_t row = static_cast<size_t>(kWidth) * (bits / 8);
    *px = {kWidth, kHeight, bits, static_cast<uint8_t *>(PX_malloc(row * kHeight))};
    for (int32_t y = 0; y < kHeight; ++y)
        std::memcpy(px->data + y * row, im->bits + static_cast<size_t>(y) * im->pitch, row);
    free_Image(&im, 0);
    return px;
}

// Runs `op` on a fresh copy of the picture each iteration (the copy untimed).
template <class Op> void in_place(benchmark::State &state, Op op) {
    const auto bits = static_cast<int32_t>(state.range(0));
    PXImage *src = make_packed(bits);
    PXImage *work = make_packed(bits);
    const size_t bytes = static_cast<size_t>(kWidth) * kHeight * (bits / 8);
    for (auto _ : state) {
        state.PauseTiming();
        std::memcpy(work->data, src->data, bytes);
        state.ResumeTiming();
        benchmark::DoNotOptimize(op(work));
    }
    set_rate(state);
    PXImage_Free(work);
    PXImage_Free(src);
}

template <class Op> void making(benchmark::State &state, Op op) {
    PXImage *src = make_packed(static_cast<int32_t>(state.range(0)));
    for (auto _ : state)
        PXImage_Free(op(src));
    set_rate(state);
    PXImage_Free(src);
}

void BM_ResizeHalf(benchmark::State &s) {
    making(s, [](PXImage *p) { return PXImage_Resize(p, kWidth / 2, kHeight / 2); });
}
void BM_ResizeOneAndAHalf(benchmark::State &s) {
    making(s, [](PXImage *p) { return PXImage_Resize(p, kWidth * 3 / 2, kHeight * 3 / 2); });
}
void BM_Rotate90(benchmark::State &s) { making(s, PXImage_Rotate90); }
void BM_ZoomIn(benchmark::State &s) { making(s, PXImage_ZoomIn); }
void BM_ZoomOut(benchmark::State &s) { making(s, PXImage_ZoomOut); }
void BM_Sharpen(benchmark::State &s) {
    const auto strength = static_cast<int32_t>(s.range(1));
    in_place(s, [strength](PXImage *p) { return PXImage_Sharpen(p, strength); });
}
void BM_Smooth(benchmark::State &s) {
    const auto strength = static_cast<int32_t>(s.range(1));
    in_place(s, [strength](PXImage *p) { return PXImage_Smooth(p, strength); });
}
void BM_EdgeDetection(benchmark::State &s) { in_place(s, PXImage_EdgeDetection); }
void BM_Binarization(benchmark::State &s) { in_place(s, PXImage_GrayToBinarization); }
void BM_AutoExposure(benchmark::State &s) { in_place(s, PXImage_AutoExposure); }

} // namespace

BENCHMARK(BM_ResizeHalf)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ResizeOneAndAHalf)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Rotate90)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ZoomIn)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ZoomOut)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Sharpen)
    ->ArgNames({"bits", "strength"})
    ->ArgsProduct({{8, 24}, {20, 60, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Smooth)
    ->ArgNames({"bits", "strength"})
    ->ArgsProduct({{8, 24}, {10, 30, 50, 70, 90}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_EdgeDetection)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Binarization)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AutoExposure)->ArgName("bits")->Arg(8)->Arg(24)->Unit(benchmark::kMillisecond);
