// Every operation of the registry at its default parameters, on a 1000 x 750
// picture of the first format it accepts (32 bits for colour operations):
// the broad view that the hand-made benchmarks beside it, at full size and
// against OpenCV, go deeper into. Registered in main from the registry, so a
// new operation is measured without a line here.
#include "bench_support.hpp"
#include "operations.hpp"

namespace {

using namespace pxbench;

constexpr int32_t kSmallWidth = 1000, kSmallHeight = 750;

int32_t bench_bits(const pxop::Operation &op) {
    if (op.formats & pxop::kBgra32) return 32;
    if (op.formats & pxop::kBgr24) return 24;
    return op.formats & pxop::kGray8 ? 8 : 16;
}

void run_operation(benchmark::State &state, const pxop::Operation *op) {
    Image *src = make_picture(bench_bits(*op), kSmallWidth, kSmallHeight);
    const pxop::Args args = pxop::default_args(*op);
    timed(state, block_bytes(src), 0, [&] {
        Image *out = op->run(src, args);
        benchmark::DoNotOptimize(out);
        free_Image(&out, 0);
    });
    set_rate(state, kSmallWidth, kSmallHeight);
    free_Image(&src, 0);
}

} // namespace

// The operations are registered in main, not during static initialisation:
// the registry's rows copy parameter tables defined in other files, which
// may not be initialised yet at that point.
int main(int argc, char **argv) {
    for (const pxop::Operation &op : pxop::operations())
        benchmark::RegisterBenchmark(("BM_Operation/" + std::string(op.name)).c_str(), run_operation, &op)
            ->Unit(benchmark::kMillisecond);
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv)) return 1;
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
