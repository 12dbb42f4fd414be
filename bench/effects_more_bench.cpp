// Tones, textures, glow and channel shift on a 12-megapixel picture, with a
// plain copy of the same pixel block as the yardstick for point-wise effects.
#include <cstring>

#include "bench_support.hpp"

using namespace pxbench;

namespace {

template <class Run> void run_effect(benchmark::State &state, Run run) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *dst = nullptr;
    for (auto _ : state)
        benchmark::DoNotOptimize(run(src, &dst));
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}

void BM_Memcpy(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *dst = malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount));
    for (auto _ : state) {
        std::memcpy(dst->bits, src->bits, static_cast<size_t>(src->pitch) * src->height);
        benchmark::ClobberMemory();
    }
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}

void BM_Negative(benchmark::State &state) { run_effect(state, PX_IMG_Negative); }
void BM_ClassicalPhotograph(benchmark::State &state) { run_effect(state, PX_IMG_Classical_Photograph); }
void BM_Lambency(benchmark::State &state) { run_effect(state, PX_IMG_Lambency); }
void BM_Mosaic8(benchmark::State &state) {
    run_effect(state, [](Image *s, Image **d) { return PX_IMG_Mosaic(s, d, 8); });
}
void BM_Oil4(benchmark::State &state) {
    run_effect(state, [](Image *s, Image **d) { return imOil(s, d, 4); });
}
void BM_AlterMode5(benchmark::State &state) {
    run_effect(state, [](Image *s, Image **d) { return PX_IMG_Alter(s, d, 40, -30, 20, 5); });
}

} // namespace

BENCHMARK(BM_Memcpy)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Negative)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ClassicalPhotograph)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AlterMode5)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Lambency)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Mosaic8)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Oil4)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
