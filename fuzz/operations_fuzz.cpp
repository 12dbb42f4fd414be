// Fuzzes every operation of the table: the input picks an operation, a bit
// count, a size up to 64 x 64, parameter values (inside and far outside their
// ranges) and the pixel bytes. Any crash, sanitizer report or leak is a bug.
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "operations.hpp"

namespace {

struct Reader {
    const uint8_t *p;
    size_t n;
    uint32_t take(uint32_t bytes) {
        uint32_t v = 0;
        for (uint32_t i = 0; i < bytes && n > 0; ++i, ++p, --n)
            v |= static_cast<uint32_t>(*p) << (8 * i);
        return v;
    }
};

// A value for a parameter: mostly inside its range, sometimes just outside it
// or an extreme.
double param_value(const pxop::Param &prm, Reader &in) {
    const uint32_t kind = in.take(1);
    const uint32_t raw = in.take(4);
    // 32-bit extremes for whole-number parameters only: the fractional ones are
    // percentages and scales, whose extremes would only ask for gigantic pictures.
    switch (prm.integer ? kind % 8 : 2 + kind % 6) {
    case 0: return -2147483648.0;
    case 1: return 2147483647.0;
    case 2: return prm.lo - 1 - raw % 1000;
    // Fractional parameters (scales, percentages) overshoot by at most their
    // range: a scale far above it only asks for a gigantic, slow result.
    case 3: return prm.hi + 1 + (prm.integer ? raw % 1000 : (prm.hi - prm.lo) * (raw % 1000) / 1000.0);
    default: {
        const double v = prm.lo + (prm.hi - prm.lo) * (raw / 4294967295.0);
        return prm.integer ? static_cast<double>(static_cast<int64_t>(v)) : v;
    }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Reader in{data, size};
    const auto &table = pxop::operations();
    const pxop::Operation &op = table[in.take(1) % table.size()];
    static const int32_t kBits[] = {8, 16, 24, 32};
    const int32_t bits = kBits[in.take(1) % 4];
    const int32_t w = 1 + static_cast<int32_t>(in.take(1) % 64), h = 1 + static_cast<int32_t>(in.take(1) % 64);
    pxop::Args args;
    for (const pxop::Param &prm : op.params)
        args.values.push_back(param_value(prm, in));
    Image *src = malloc_Image(w, h, bits);
    if (src == nullptr) return 0;
    const size_t bytes = static_cast<size_t>(src->pitch) * src->height;
    for (size_t i = 0; i < bytes; ++i)
        src->bits[i] = in.n > 0 ? static_cast<uint8_t>(in.take(1)) : static_cast<uint8_t>(i * 131);
    Image *out = op.run(src, args);
    free_Image(&out, 0);
    free_Image(&src, 0);
    return 0;
}
