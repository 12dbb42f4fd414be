// Deformations on a 3-megapixel picture.
#include "bench_support.hpp"

using namespace pxbench;

namespace {

constexpr int32_t kW = 2000, kH = 1500;

static void BM_Polar(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(1)), kW, kH);
    Image *dst = nullptr;
    const int32_t mode = static_cast<int32_t>(state.range(0));
    for (auto _ : state)
        benchmark::DoNotOptimize(CircleTransform(src, &dst, mode, 0, mode == 4 ? 1.0f : 100.0f));
    set_rate(state, kW, kH);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Polar)
    ->ArgNames({"mode", "bits"})
    ->ArgsProduct({{0, 1, 2, 3, 4}, {24, 32}})
    ->Unit(benchmark::kMillisecond);

static void BM_Wave(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)), kW, kH);
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(Wave_Transform(src, &dst, 10));
    set_rate(state, kW, kH);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_Wave)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

static void BM_FreeForm(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)), kW, kH);
    Image *dst = nullptr;
    // A gentle bend: two corners held, two middle points pushed aside.
    const DeformationPair pairs[] = {
        {100, 100, 100, 100}, {1900, 1400, 1900, 1400}, {700, 750, 760, 700}, {1300, 750, 1250, 800}};
    for (auto _ : state)
        benchmark::DoNotOptimize(DeformationImage(src, pairs, 4, &dst));
    set_rate(state, kW, kH);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}
BENCHMARK(BM_FreeForm)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);

} // namespace
