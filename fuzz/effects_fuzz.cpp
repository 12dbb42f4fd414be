// Fuzzes the artistic effects directly on hand-made records (odd pitches,
// odd bit counts, no pixels) with result slots that are null, empty, reusable
// or of another shape, and with parameters far outside their ranges.
#include "fuzz_input.hpp"

namespace {

using namespace fuzz;

using Effect = uint32_t (*)(Image *, Image **);

const Effect kEffects[] = {
    PX_IMG_Neon,
    PX_IMG_Emboss,
    PX_IMG_Photocopy,
    PX_IMG_Sketch,
    PX_IMG_Sketch_1,
    PX_IMG_Negative,
    PX_IMG_WARM_YELLOW,
    PX_IMG_COLD_PUPRLE,
    my,
    PX_IMG_Classical_Photograph,
    PX_IMG_Line,
    PX_IMG_Repristination,
    PX_IMG_Lambency,
};
constexpr uint32_t kEffectCount = sizeof kEffects / sizeof kEffects[0];

void sample(Input &in) {
    const int32_t w = in.range(1, 32), h = in.range(1, 32);
    // The sum reads column `width`, one byte past the last row's end.
    std::vector<uint8_t> plane(static_cast<size_t>(w) * static_cast<size_t>(h) + 1);
    fill(in, plane.data(), plane.size());
    // The kernel holds size * size weights; larger sizes go with no kernel.
    const int32_t size = in.one_in(16) ? in.param(-2, 9) : in.range(1, 9);
    std::vector<int32_t> kernel = ints(in, size > 0 && size <= 9 ? static_cast<size_t>(size * size) : 1, -8, 8);
    temp_ex(maybe_null(in, plane), w, h, size <= 9 ? maybe_null(in, kernel) : nullptr, size, in.param(-4, h + 4),
            in.param(-4, w + 4));
}

void compress(Input &in) {
    ImageGuard plane{make_plane(in)};
    ColorCompress(plane.img, in.param(1, 300));
}

void oil_posterise(Input &in) {
    ImageGuard src{make_image(in)};
    // Its slot must be empty: an image there is not released.
    Image *out = nullptr;
    imOil_1(src.img, in.one_in(16) ? nullptr : &out);
    free_Image(&out, 0);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    Input in(data, size);
    const uint32_t pick = in.byte() % (kEffectCount + 11);
    if (pick == kEffectCount) return sample(in), 0;
    if (pick == kEffectCount + 1) return compress(in), 0;
    if (pick == kEffectCount + 2) return oil_posterise(in), 0;
    ImageGuard src{make_image(in)};
    Image *source = in.one_in(32) ? nullptr : src.img;
    Slot out(in, src.img);
    if (pick < kEffectCount) {
        kEffects[pick](source, out.get());
        return 0;
    }
    switch (pick - kEffectCount - 3) {
    case 0: PX_ProcessImage(source, out.get(), static_cast<uint32_t>(in.param(0, 4))); break;
    case 1:
        PX_IMG_Light_Alter(source, out.get(), static_cast<uint32_t>(in.param(0, 300)),
                           static_cast<uint32_t>(in.param(0, 3)));
        break;
    case 2: PX_IMG_Ballance(source, out.get(), in.param(-100, 100)); break;
    case 3: PX_IMG_Mosaic(source, out.get(), in.param(1, 70)); break;
    case 4: PX_IMG_Aquarelle(source, out.get(), in.param(0, 10)); break;
    case 5: imOil(source, out.get(), in.param(0, 8)); break;
    default:
        PX_IMG_Alter(source, out.get(), in.param(-127, 127), in.param(-127, 127), in.param(-127, 127),
                     static_cast<uint32_t>(in.param(0, 6)));
        break;
    }
    return 0;
}
