// Portrait tools on the sample portrait scaled to 4000 x 3000.
#include "bench_support.hpp"

using namespace pxbench;

namespace {

template <class Run> void on_photo(benchmark::State &state, int32_t bits, Run run) {
    into_slot(state, load_photo(bits), run);
}

void BM_Skin(benchmark::State &state) {
    on_photo(state, static_cast<int32_t>(state.range(0)), [](Image *s, Image **d) { return alg_Img_Skin(s, d, 1); });
}
void BM_AutoGradation(benchmark::State &state) {
    on_photo(state, static_cast<int32_t>(state.range(0)),
             [](Image *s, Image **d) { return ImageAutoGradationProcess(s, d, 60); });
}
void BM_OneKeyFilter(benchmark::State &state) { on_photo(state, 8, MyOneKeyFliter); }

void BM_LightUP(benchmark::State &state) {
    Image *img = make_source(static_cast<int32_t>(state.range(0)), state.range(1));
    timed(state, block_bytes(img), 0, [&] { benchmark::DoNotOptimize(LightUP(img)); });
    set_rate(state);
    free_Image(&img, 0);
}

// One stroke: the cache is built before timing, then 100 dabs of radius 40.
void BM_SmoothStroke(benchmark::State &state) {
    Image *pic = load_photo(32);
    Image *cache = nullptr;
    alg_smooth(pic, 0, 0, 0, 0, 10, &cache);
    timed(state, block_bytes(pic), 0, [&] {
        for (int32_t i = 0; i < 100; ++i)
            benchmark::DoNotOptimize(alg_smooth(pic, 0, 1500 + 10 * i, 1200 + 3 * i, 40, 10, &cache));
    });
    free_Image(&cache, 0);
    free_Image(&pic, 0);
}

void BM_EyesEnlarge(benchmark::State &state) {
    Image *src = load_photo(24);
    Image *work = malloc_Image(kWidth, kHeight, 24);
    timed(state, block_bytes(src), 0, [&] {
        state.PauseTiming();
        PX_Img_Copy(work, src);
        state.ResumeTiming();
        benchmark::DoNotOptimize(EyesEnlarge(work));
    });
    set_rate(state);
    free_Image(&work, 0);
    free_Image(&src, 0);
}

} // namespace

BENCHMARK(BM_Skin)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AutoGradation)->ArgName("bits")->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_OneKeyFilter)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_LightUP)->ArgNames({"bits", "photo"})->ArgsProduct({{24, 32}, {0}})->Unit(benchmark::kMillisecond);
BENCHMARK(BM_SmoothStroke)->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_EyesEnlarge)->Unit(benchmark::kMillisecond);
