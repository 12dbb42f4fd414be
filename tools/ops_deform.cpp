// Table entries of the geometric deformations.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;

namespace {

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
                 "CircleTransform",
                 "Deformations",
                 "Polar mapping around the centre",
                 {{"mode", true, 0, 4, 2, "0 punch, 1 pinch, 2 swirl, 3 cylinder, 4 bathroom"},
                  {"radius", true, 0, 100000, 0, "circle radius, 0 for the half diagonal"},
                  {"factor", false, 1, 10000, 40, "swirl divisor"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(CircleTransform, in, a.i(0), a.i(1), a.f(2)); }});
    t.push_back({"punch",
                 "Punch_Transform",
                 "Deformations",
                 "Bulge inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Punch_Transform, in); }});
    t.push_back({"pinch",
                 "Pinch_Transform",
                 "Deformations",
                 "Pinch inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Pinch_Transform, in); }});
    t.push_back({"swirl",
                 "Swirl_Transform",
                 "Deformations",
                 "Swirl inside the centre circle",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Swirl_Transform, in); }});
    t.push_back({"cylinder",
                 "Cylinder_Transform",
                 "Deformations",
                 "Polar unrolling onto a cylinder",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Cylinder_Transform, in); }});
    t.push_back({"bathroom",
                 "Bathroom_Transform",
                 "Deformations",
                 "Vertical ribs of frosted glass",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(Bathroom_Transform, in); }});
    t.push_back({"wave",
                 "Wave_Transform",
                 "Deformations",
                 "Concentric ripples around the centre",
                 {{"amplitude", true, 0, 20, 10, "largest displacement in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(Wave_Transform, in, a.i(0)); }});
    t.push_back({"warp",
                 "DeformationImage",
                 "Deformations",
                 "Moves one point, corners held, the rest following",
                 {{"from-x", false, 0, 100, 50, "source point, percent of the width"},
                  {"from-y", false, 0, 100, 50, "source point, percent of the height"},
                  {"to-x", false, 0, 100, 58, "target point, percent of the width"},
                  {"to-y", false, 0, 100, 44, "target point, percent of the height"}},
                 kAllFormats,
                 warp});
}

} // namespace pxop
