// Table entries of the geometric deformations.
#include <climits>
#include <cmath>

#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;

namespace {

using C = Call<Image>;

// Pairs with ordinary, huge, extreme and non-finite coordinates.
const DeformationPair kHostilePairs[] = {
    {1, 1, 2, 2}, {1e300, 3, 4, -1e300}, {5, INT_MIN, INT_MAX, 6}, {NAN, 1, 1, INFINITY}};

// A still height map covering a picture of up to 4096 x 4096 (rows of the
// width rounded up to 4 entries); 16 x 16 for any other record.
std::vector<int16_t> flat_wave_map(const Image *im) {
    const bool fits = im != nullptr && im->width > 0 && im->height > 0 && im->width <= 4096 && im->height <= 4096;
    return std::vector<int16_t>(fits ? (static_cast<size_t>(im->width) + 3) / 4 * 4 * im->height : 16 * 16);
}

// Warps into a slot from one picture of any bit count. Sources of an empty
// size have nothing to map: a matching slot is kept (1) unless `empty` says
// otherwise.
Contract<Image> slot_warp(std::function<int64_t(C &)> call, const char *empty = "1k 1k 1k 1k") {
    return {.formats = kAnyBits, .call = std::move(call), .empty_sources = empty};
}
// Functions writing one picture into another of the same size; a source
// without pixels reads as 0 instead of being refused.
Contract<Image> two(std::function<int64_t(C &)> call, int64_t failure = 0) {
    return {.formats = kAnyBits,
            .call = std::move(call),
            .failure = failure,
            .pictures = 2,
            .slot = false,
            .mismatch_fails = true,
            .accepts = {"null pixels"}};
}

// Four fixed anchors near the corners and one pair moving a point.
Image *warp(const Image *in, const Args &a) {
    const double w = in->width, h = in->height;
    const DeformationPair pairs[5] = {
        {0.1 * w, 0.1 * h, 0.1 * w, 0.1 * h},
        {0.9 * w, 0.1 * h, 0.9 * w, 0.1 * h},
        {0.1 * w, 0.9 * h, 0.1 * w, 0.9 * h},
        {0.9 * w, 0.9 * h, 0.9 * w, 0.9 * h},
        {a.values[0] * w / 100, a.values[1] * h / 100, a.values[2] * w / 100, a.values[3] * h / 100}};
    Image *out = nullptr;
    if (DeformationImage(const_cast<Image *>(in), pairs, 5, &out) != 1) free_Image(&out, 0);
    return out;
}

} // namespace

void add_deform(std::vector<Operation> &t) {
    t.push_back({"polar",
                 PXOP_FN(CircleTransform),
                 "Deformations",
                 "Polar mapping around the centre",
                 {{"mode", true, 0, 4, 2, "0 punch, 1 pinch, 2 swirl, 3 cylinder, 4 bathroom"},
                  {"radius", true, 0, 100000, 0, "circle radius, 0 for the half diagonal"},
                  {"factor", false, 1, 10000, 40, "swirl divisor"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(CircleTransform, in, a.i(0), a.i(1), a.f(2)); },
                 slot_warp([](C &c) { return CircleTransform(c.a, c.slot, c.p, c.p, float(c.p)); })});
    t.push_back({"punch",
                 PXOP_FN(Punch_Transform),
                 "Deformations",
                 "Bulge inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Punch_Transform, in); },
                 slot_warp([](C &c) { return Punch_Transform(c.a, c.slot); })});
    t.push_back({"pinch",
                 PXOP_FN(Pinch_Transform),
                 "Deformations",
                 "Pinch inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Pinch_Transform, in); },
                 slot_warp([](C &c) { return Pinch_Transform(c.a, c.slot); })});
    t.push_back({"swirl",
                 PXOP_FN(Swirl_Transform),
                 "Deformations",
                 "Swirl inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Swirl_Transform, in); },
                 slot_warp([](C &c) { return Swirl_Transform(c.a, c.slot); })});
    t.push_back({"cylinder",
                 PXOP_FN(Cylinder_Transform),
                 "Deformations",
                 "Polar unrolling onto a cylinder",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Cylinder_Transform, in); },
                 slot_warp([](C &c) { return Cylinder_Transform(c.a, c.slot); })});
    t.push_back({"bathroom",
                 PXOP_FN(Bathroom_Transform),
                 "Deformations",
                 "Vertical ribs of frosted glass",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Bathroom_Transform, in); },
                 slot_warp([](C &c) { return Bathroom_Transform(c.a, c.slot); })});
    t.push_back({"wave",
                 PXOP_FN(Wave_Transform),
                 "Deformations",
                 "Concentric ripples around the centre",
                 {{"amplitude", true, 0, 20, 10, "largest displacement in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(Wave_Transform, in, a.i(0)); },
                 // Its map of height x stride x 2 bytes comes first.
                 // The wave's map of height x stride x 2 bytes: only two negative sizes give one.
                 slot_warp([](C &c) { return Wave_Transform(c.a, c.slot, c.p); }, "0k 0k 0k 1k")});
    t.push_back({"warp",
                 PXOP_FN(DeformationImage),
                 "Deformations",
                 "Moves one point, corners held, the rest following",
                 {{"from-x", false, 0, 100, 50, "source point, percent of the width"},
                  {"from-y", false, 0, 100, 50, "source point, percent of the height"},
                  {"to-x", false, 0, 100, 58, "target point, percent of the width"},
                  {"to-y", false, 0, 100, 44, "target point, percent of the height"}},
                 kAllFormats,
                 warp,
                 Contract<Image>{.formats = kAnyBits,
                                 .call = [](C &c) { return DeformationImage(c.a, kHostilePairs, 4, c.slot); },
                                 .keeps_result_on_failure = true,
                                 // The black background laid over the block the record claims.
                                 .empty_sources = "1z 1z 1k 1k"}});
    t.push_back(contract_row(PXOP_FN(DeformationFunc), "Deformations",
                             two([](C &c) -> int64_t { return DeformationFunc(c.a, c.b, kHostilePairs, 4); })));
    t.push_back(contract_row(PXOP_FN(render_wave), "Deformations",
                             two(
                                 [](C &c) -> int64_t {
                                     const std::vector<int16_t> map = flat_wave_map(c.a);
                                     return render_wave(c.a, c.b, map.data(), c.p, c.p), 0;
                                 },
                                 kNoResult)));
}

} // namespace pxop
