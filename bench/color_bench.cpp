// Colour spaces, kernel and box filters and the curve filters on a
// 12-megapixel picture.
#include "bench_support.hpp"

using namespace pxbench;

static void BM_SplitCombineHsl(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *h = nullptr, *s = nullptr, *l = nullptr, *a = nullptr;
    for (auto _ : state) {
        Split(src, &h, &s, &l, &a, 1);
        Image *back = Combine(h, s, l, a, 1);
        benchmark::DoNotOptimize(back);
        free_Image(&back, 0);
    }
    set_rate(state);
    for (Image **p : {&h, &s, &l, &a, &src})
        free_Image(p, 0);
}
BENCHMARK(BM_SplitCombineHsl)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

static void BM_Blur(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(PX_IMG_Blur(src, &dst));
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Blur)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

static void BM_FilterFast10(benchmark::State &state) {
    Image *img = make_picture(static_cast<int32_t>(state.range(0)));
    for (auto _ : state)
        benchmark::DoNotOptimize(Filter_fast(img, 10, 0));
    set_rate(state);
    free_Image(&img, 0);
}
BENCHMARK(BM_FilterFast10)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

static void BM_Transform(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(PX_IMG_Transform(src, &dst, 150, 0));
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Transform)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

// The curve filter works on single planes: one 8-bit plane of the picture's size.
static void BM_ColorFilterZanto(benchmark::State &state) {
    Image *plane = make_picture(8);
    for (auto _ : state)
        benchmark::DoNotOptimize(ColorFilter_zanto(plane, 200));
    set_rate(state);
    free_Image(&plane, 0);
}
BENCHMARK(BM_ColorFilterZanto)->Unit(benchmark::kMillisecond);
