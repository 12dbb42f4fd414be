// Effects on a 12-megapixel picture, with a plain copy of the same pixel
// block as the yardstick for the point-wise ones.
#include <cstring>

#include "bench_support.hpp"

using namespace pxbench;

namespace {

template <class Run> void run_effect(benchmark::State &state, Run run) { into_slot(state, source_of(state), run); }

void BM_Memcpy(benchmark::State &state) {
    Image *src = make_picture(static_cast<int32_t>(state.range(0)));
    Image *dst = malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount));
    timed(state, block_bytes(src), 0, [&] {
        std::memcpy(dst->bits, src->bits, static_cast<size_t>(src->pitch) * src->height);
        benchmark::ClobberMemory();
    });
    set_rate(state);
    free_Image(&dst, 0);
    free_Image(&src, 0);
}

void BM_Effect(benchmark::State &state) {
    const auto effect = static_cast<uint32_t>(state.range(2));
    run_effect(state, [effect](Image *s, Image **d) { return PX_ProcessImage(s, d, effect); });
}
void BM_Sketch(benchmark::State &state) { run_effect(state, PX_IMG_Sketch); }
void BM_Negative(benchmark::State &state) { run_effect(state, PX_IMG_Negative); }
void BM_WarmYellow(benchmark::State &state) { run_effect(state, PX_IMG_WARM_YELLOW); }
void BM_ColdPurple(benchmark::State &state) { run_effect(state, PX_IMG_COLD_PUPRLE); }
void BM_ClassicalPhotograph(benchmark::State &state) { run_effect(state, PX_IMG_Classical_Photograph); }
void BM_Lambency(benchmark::State &state) { run_effect(state, PX_IMG_Lambency); }
void BM_Mosaic8(benchmark::State &state) {
    run_effect(state, [](Image *s, Image **d) { return PX_IMG_Mosaic(s, d, 8); });
}
void BM_Oil(benchmark::State &state) {
    const auto r = static_cast<int32_t>(state.range(2));
    run_effect(state, [r](Image *s, Image **d) { return imOil(s, d, r); });
}
void BM_Alter(benchmark::State &state) {
    const auto mode = static_cast<uint32_t>(state.range(2));
    run_effect(state, [mode](Image *s, Image **d) { return PX_IMG_Alter(s, d, 40, -30, 20, mode); });
}

} // namespace

#define PXFX_EFFECT_ARGS ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0}})->Unit(benchmark::kMillisecond)
BENCHMARK(BM_Memcpy)->ArgNames({"bits"})->Arg(8)->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Effect)
    ->ArgNames({"bits", "photo", "effect"})
    ->ArgsProduct({{24, 32}, {0}, {0, 1, 2, 3}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Sketch)->ArgNames({"bits", "photo"})->Args({24, 0})->Args({24, 1})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Negative)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_WarmYellow)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_ColdPurple)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_ClassicalPhotograph)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_Alter)
    ->ArgNames({"bits", "photo", "mode"})
    ->ArgsProduct({{24, 32}, {0}, {0, 5}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Lambency)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_Mosaic8)->PXFX_EFFECT_ARGS;
BENCHMARK(BM_Oil)
    ->ArgNames({"bits", "photo", "r"})
    ->Args({24, 0, 4})
    ->Args({24, 1, 4})
    ->Args({32, 0, 4})
    ->Unit(benchmark::kMillisecond);
