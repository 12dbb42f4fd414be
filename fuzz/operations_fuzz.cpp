// Fuzzes every row of the registry. Half the inputs run a tool operation on
// a well-formed picture of up to 64 x 64 at a chosen bit count, with
// parameter values inside and far outside their ranges; the other half call a
// function through its contract with hand-made records (odd pitches, odd bit
// counts, no pixels, empty sizes), result slots that are null, empty,
// reusable or of another shape, and the parameter at ordinary values or
// extremes. Any crash, sanitizer report or leak is a bug.
#include <cstddef>
#include <cstdint>
#include <variant>

#include "fuzz_input.hpp"
#include "operations.hpp"

namespace {

using namespace fuzz;

// A value for a parameter: mostly inside its range, sometimes just outside it
// or an extreme.
double param_value(const pxop::Param &prm, Input &in) {
    const uint32_t kind = in.byte();
    const uint32_t raw = in.u32();
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

void run_operation(const pxop::Operation &op, Input &in) {
    static const int32_t kBits[] = {8, 16, 24, 32};
    const int32_t bits = kBits[in.byte() % 4];
    const int32_t w = in.range(1, 64), h = in.range(1, 64);
    pxop::Args args;
    for (const pxop::Param &prm : op.params)
        args.values.push_back(param_value(prm, in));
    Image *src = malloc_Image(w, h, bits);
    if (src == nullptr) return;
    fill(in, src->bits, static_cast<size_t>(src->pitch) * src->height);
    Image *out = op.run(src, args);
    free_Image(&out, 0);
    free_Image(&src, 0);
}

// The parameter of a contract call: the values the contract tests use, or a
// small ordinary one. Taken as a kernel size or radius, p costs about the
// picture's pixels times p^2: values from 3 up to 65535 are held where that
// passes 2^20, about a second of a sanitized run (a
// 64 x 64 picture takes a kernel of 16, one of several hundred pixels a side
// a kernel of 3 or 2). The extremes beyond are refused or clipped at once.
template <class Picture> int32_t contract_param(Input &in, const Picture *picture) {
    static const int32_t kExtremes[] = {INT32_MIN, -70000, -256, -1, 0, 1, 2, 255, 256, 70000, INT32_MAX};
    int32_t p = in.one_in(4) ? kExtremes[in.byte() % 11] : in.range(-2, 64);
    const int64_t pixels =
        picture != nullptr && picture->width > 0 && picture->height > 0 ? int64_t{picture->width} * picture->height : 1;
    while (p > 2 && p < 65536 && pixels * p * p > (int64_t{1} << 20))
        p = p / 2 > 2 ? p / 2 : 2;
    return p;
}

void call(const pxop::Contract<Image> &c, Input &in) {
    ImageGuard a{make_image(in)};
    ImageGuard b{c.pictures > 1 ? make_partner(in, a.img) : nullptr};
    Slot out(in, a.img);
    pxop::Call<Image> call{in.one_in(32) ? nullptr : a.img, b.img};
    // A function that wants an empty slot gets one (or none).
    if (!c.empty_slot)
        call.slot = out.get();
    else if (in.one_in(16))
        call.slot = nullptr;
    call.p = contract_param(in, a.img);
    const auto &fn = c.also && in.one_in(2) ? c.also : c.call;
    fn(call);
    // The picture in the call's own slot, or one the function returned.
    free_Image(&call.out, 0);
}

void call(const pxop::Contract<PXImage> &c, Input &in) {
    PXImageGuard a{make_pximage(in)};
    PXImageGuard b{c.pictures > 1 ? make_pximage(in) : nullptr};
    pxop::Call<PXImage> call{in.one_in(32) ? nullptr : a.img, b.img};
    call.p = contract_param(in, a.img);
    c.call(call);
    PXImage_Free(call.out);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    const auto &rows = pxop::registry();
    const pxop::Operation &row = rows[in.byte() % rows.size()];
    if (!row.name.empty() && in.one_in(2)) {
        run_operation(row, in);
        return 0;
    }
    std::visit(
        [&in](const auto &c) {
            if constexpr (!std::is_same_v<std::decay_t<decltype(c)>, std::monostate>) call(c, in);
        },
        row.contract);
    return 0;
}
