// Deformations on a 12-megapixel picture.
#include "bench_support.hpp"

using namespace pxbench;

namespace {

template <class Run> void deform(benchmark::State &state, Run run) {
    into_slot(state, make_source(static_cast<int32_t>(state.range(0)), 0), run);
}

void BM_Polar(benchmark::State &state) {
    const auto mode = static_cast<int32_t>(state.range(1));
    deform(state, [mode](Image *s, Image **d) { return CircleTransform(s, d, mode, 0, mode == 4 ? 1.0f : 100.0f); });
}
void BM_Wave(benchmark::State &state) {
    deform(state, [](Image *s, Image **d) { return Wave_Transform(s, d, 10); });
}
void BM_FreeForm(benchmark::State &state) {
    // A gentle bend: two corners held, two middle points pushed aside.
    static const DeformationPair pairs[] = {
        {200, 200, 200, 200}, {3800, 2800, 3800, 2800}, {1400, 1500, 1520, 1400}, {2600, 1500, 2500, 1600}};
    deform(state, [](Image *s, Image **d) { return DeformationImage(s, pairs, 4, d); });
}

} // namespace

BENCHMARK(BM_Polar)
    ->ArgNames({"bits", "mode"})
    ->ArgsProduct({{24, 32}, {0, 1, 2, 3, 4}})
    ->Unit(benchmark::kMillisecond);
BENCHMARK(BM_Wave)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_FreeForm)->ArgNames({"bits"})->Arg(24)->Arg(32)->Unit(benchmark::kMillisecond);
