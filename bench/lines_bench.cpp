// Line tools on 8-bit luma planes of 1280 x 720, 1920 x 1080 and 4000 x 3000.
#include <pxfx/lines.h>

#include "bench_support.hpp"

using namespace pxbench;

namespace {

// Runs fn(plane, &result) on a fresh copy of the plane each iteration, since
// every tool below may change or replace its input.
// `outScale` is the size of the result the tool makes, relative to the plane.
template <class Fn> void run_on_plane(benchmark::State &state, double outScale, Fn fn) {
    const int32_t w = static_cast<int32_t>(state.range(0)), h = static_cast<int32_t>(state.range(1));
    Image *src = make_picture(8, w, h);
    Image *work = malloc_Image(w, h, 8);
    Image *dst = nullptr;
    timed(state, block_bytes(src), block_bytes(src) * outScale, [&] {
        PX_Img_Copy(work, src);
        benchmark::DoNotOptimize(fn(work, &dst));
    });
    set_rate(state, w, h);
    free_Image(&dst, 0);
    free_Image(&work, 0);
    free_Image(&src, 0);
}

void BM_RecognizeYUV(benchmark::State &state) { run_on_plane(state, 1.0, RecognizeYUV); }
void BM_MyFliter(benchmark::State &state) { run_on_plane(state, 1.0, MyFliter); }
void BM_MyFliter1(benchmark::State &state) { run_on_plane(state, 1.0, MyFliter1); }
void BM_MyResample2x4(benchmark::State &state) {
    // The result is four times the plane's height.
    run_on_plane(state, 4.0, [](Image *im, Image **) {
        Image *r = MyResample2(im, 4);
        free_Image(&r, 0);
        return 1;
    });
}

} // namespace

#define PXFX_LINES_SIZES                                                                                               \
    ArgNames({"w", "h"})->Args({1280, 720})->Args({1920, 1080})->Args({kWidth, kHeight})->Unit(benchmark::kMillisecond)
BENCHMARK(BM_RecognizeYUV)->PXFX_LINES_SIZES;
BENCHMARK(BM_MyResample2x4)->PXFX_LINES_SIZES;
BENCHMARK(BM_MyFliter)->PXFX_LINES_SIZES;
BENCHMARK(BM_MyFliter1)->PXFX_LINES_SIZES;
