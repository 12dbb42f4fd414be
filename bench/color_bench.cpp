// Colour spaces, kernel and box filters and the curve filters on a
// 12-megapixel picture.
#include "bench_support.hpp"

using namespace pxbench;

namespace {

void BM_SplitCombineHsl(benchmark::State &state) {
    Image *src = source_of(state);
    Image *h = nullptr, *s = nullptr, *l = nullptr, *a = nullptr;
    timed(state, block_bytes(src), 4.0 * kWidth * kHeight + block_bytes(src), [&] {
        Split(src, &h, &s, &l, &a, 1);
        Image *back = Combine(h, s, l, a, 1);
        benchmark::DoNotOptimize(back);
        free_Image(&back, 0);
    });
    set_rate(state);
    for (Image **p : {&h, &s, &l, &a, &src})
        free_Image(p, 0);
}

void BM_Blur(benchmark::State &state) { into_slot(state, source_of(state), PX_IMG_Blur); }
void BM_ImgSharpen(benchmark::State &state) { into_slot(state, source_of(state), PX_IMG_Sharpen); }
void BM_Transform(benchmark::State &state) {
    into_slot(state, source_of(state), [](Image *s, Image **d) { return PX_IMG_Transform(s, d, 150, 0); });
}

void BM_FilterFast(benchmark::State &state) {
    Image *img = source_of(state);
    const auto size = static_cast<int32_t>(state.range(2));
    timed(state, block_bytes(img), 0, [&] { benchmark::DoNotOptimize(Filter_fast(img, size, 0)); });
    set_rate(state);
    free_Image(&img, 0);
}

// The curve filters work in place on 8-bit planes (ColorFilter24 on 24-bit pictures).
template <class Run> void in_place(benchmark::State &state, Run run) {
    Image *img = source_of(state);
    timed(state, block_bytes(img), 0, [&] { benchmark::DoNotOptimize(run(img)); });
    set_rate(state);
    free_Image(&img, 0);
}

void BM_ColorFilterZanto(benchmark::State &state) {
    in_place(state, [](Image *im) { return ColorFilter_zanto(im, 200); });
}
void BM_ColorFilter1(benchmark::State &state) {
    in_place(state, [](Image *im) { return ColorFilter1(im, 200); });
}
void BM_ColorFilter(benchmark::State &state) {
    in_place(state, [](Image *im) { return ColorFilter(im, 0x2080E0u, nullptr); });
}
void BM_ColorFilter24(benchmark::State &state) {
    in_place(state, [](Image *im) { return ColorFilter24(im, 0x2080E0u, nullptr); });
}

} // namespace

#define PXFX_COLOUR_ARGS ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0, 1}})->Unit(benchmark::kMillisecond)
BENCHMARK(BM_SplitCombineHsl)->PXFX_COLOUR_ARGS;
BENCHMARK(BM_Blur)->PXFX_COLOUR_ARGS;
BENCHMARK(BM_ImgSharpen)->ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Transform)->ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_FilterFast)
    ->ArgNames({"bits", "photo", "size"})
    ->ArgsProduct({{8, 24, 32}, {0, 1}, {10}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ColorFilterZanto)->ArgNames({"bits", "photo"})->Args({8, 0})->Args({8, 1})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ColorFilter1)->ArgNames({"bits", "photo"})->Args({8, 0})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ColorFilter)->ArgNames({"bits", "photo"})->Args({8, 0})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ColorFilter24)->ArgNames({"bits", "photo"})->Args({24, 0})->Unit(benchmark::kMillisecond);
