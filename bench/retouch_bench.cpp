// Portrait tools on the sample portrait scaled to 2000 x 2000.
#include "bench_support.hpp"

namespace {

constexpr int32_t kSide = 2000;

Image *make_portrait(int32_t bitCount) { return pxbench::load_portrait(kSide, bitCount); }

void BM_Skin(benchmark::State &state) {
    Image *src = make_portrait(static_cast<int32_t>(state.range(0)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(alg_Img_Skin(src, &dst, 1));
    pxbench::set_rate(state, kSide, kSide);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Skin)->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

void BM_AutoGradation(benchmark::State &state) {
    Image *src = make_portrait(static_cast<int32_t>(state.range(0)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(ImageAutoGradationProcess(src, &dst, 60));
    pxbench::set_rate(state, kSide, kSide);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_AutoGradation)->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

void BM_OneKeyFilter(benchmark::State &state) {
    Image *src = make_portrait(8);
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(MyOneKeyFliter(src, &dst));
    pxbench::set_rate(state, kSide, kSide);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_OneKeyFilter)->Unit(benchmark::kMillisecond);

// One stroke: the cache is built before timing, then 100 dabs of radius 40.
void BM_SmoothStroke(benchmark::State &state) {
    Image *pic = make_portrait(32);
    Image *cache = nullptr;
    alg_smooth(pic, 0, 0, 0, 0, 10, &cache);
    for (auto _ : state)
        for (int32_t i = 0; i < 100; ++i)
            benchmark::DoNotOptimize(alg_smooth(pic, 0, 500 + 10 * i, 900 + 3 * i, 40, 10, &cache));
    free_Image(&cache, 0);
    free_Image(&pic, 0);
}
BENCHMARK(BM_SmoothStroke)->Unit(benchmark::kMicrosecond);

void BM_EyesEnlarge(benchmark::State &state) {
    Image *src = make_portrait(24);
    Image *work = malloc_Image(kSide, kSide, 24);
    for (auto _ : state) {
        state.PauseTiming();
        PX_Img_Copy(work, src);
        state.ResumeTiming();
        benchmark::DoNotOptimize(EyesEnlarge(work));
    }
    pxbench::set_rate(state, kSide, kSide);
    free_Image(&work, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_EyesEnlarge)->Unit(benchmark::kMillisecond);

} // namespace
