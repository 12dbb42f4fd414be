// Fuzzes the effects' kernel sum on raw planes: any kernel size, kernels of
// fuzzed weights or none, and positions on, beside and far off the plane.
// The effects on pictures are fuzzed through the registry (operations).
#include "fuzz_input.hpp"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t bytes) {
    using namespace fuzz;
    Input in(data, bytes);
    const int32_t w = in.range(1, 32), h = in.range(1, 32);
    // The sum reads column `width`, one byte past the last row's end.
    std::vector<uint8_t> plane(static_cast<size_t>(w) * static_cast<size_t>(h) + 1);
    fill(in, plane.data(), plane.size());
    // The kernel holds size * size weights; larger sizes go with no kernel.
    const int32_t size = in.one_in(16) ? in.param(-2, 9) : in.range(1, 9);
    std::vector<int32_t> kernel = ints(in, size > 0 && size <= 9 ? static_cast<size_t>(size * size) : 1, -8, 8);
    temp_ex(maybe_null(in, plane), w, h, size <= 9 ? maybe_null(in, kernel) : nullptr, size, in.param(-4, h + 4),
            in.param(-4, w + 4));
    return 0;
}
