// Portrait tools on a synthetic 2000 x 2000 portrait: a skin-toned face
// with noise on a cooler background, two dark eye blobs and a few specks.
#include "bench_support.hpp"

namespace {

constexpr int32_t kSide = 2000;

Image *make_portrait(int32_t bitCount) {
    Image *im = malloc_Image(kSide, kSide, bitCount);
    std::mt19937 rng(7);
    const int32_t cx = kSide / 2, cy = kSide / 2, rx = kSide * 2 / 5, ry = kSide / 2 - 40;
    for (int32_t y = 0; y < kSide; ++y)
        for (int32_t x = 0; x < kSide; ++x) {
            const int64_t dx = x - cx, dy = y - cy;
            const bool face = dx * dx * ry * ry + dy * dy * rx * rx <= int64_t(rx) * rx * ry * ry;
            const uint32_t n = rng() >> 28;
            uint32_t r = 60 + n, g = 90 + n, b = 120 + n;
            if (face) r = 205 + n, g = 150 + n, b = 125 + n;
            for (int32_t eye : {cx - kSide / 6, cx + kSide / 6}) {
                const int64_t ex = x - eye, ey = y - (cy - kSide / 12);
                if (ex * ex / 4 + ey * ey <= 40 * 40) r = g = b = 30 + n;
            }
            if (face && (rng() & 1023) == 0) r = 120, g = 80, b = 70;
            SetPixelColor(im, x, y, 0xFF000000u | r << 16 | g << 8 | b);
        }
    return im;
}

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
