// Dispatched effects on a 12-megapixel picture.
#include "bench_support.hpp"

using namespace pxbench;

static void BM_Effect(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(1)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(PX_ProcessImage(src, &dst, static_cast<uint32_t>(state.range(0))));
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Effect)
    ->ArgNames({"effect", "bits"})
    ->ArgsProduct({{0, 1, 2, 3}, {24, 32}})
    ->Unit(benchmark::kMillisecond);
