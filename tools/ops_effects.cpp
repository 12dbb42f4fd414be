// Table entries of the artistic effects.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;

void add_effects(std::vector<Operation> &t) {
    t.push_back({"neon",
                 "PX_IMG_Neon",
                 "Drawing",
                 "Edge glow: doubled gradient magnitude per channel",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Neon, in); }});
    t.push_back({"emboss",
                 "PX_IMG_Emboss",
                 "Drawing",
                 "Gray relief from the diagonal difference",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Emboss, in); }});
    t.push_back({"photocopy",
                 "PX_IMG_Photocopy",
                 "Drawing",
                 "Photocopier look by local contrast thresholds",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Photocopy, in); }});
    t.push_back({"sketch",
                 "PX_IMG_Sketch",
                 "Drawing",
                 "Pencil sketch darkened along edges",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sketch, in); }});
    t.push_back({"sketch-soft",
                 "PX_IMG_Sketch_1",
                 "Drawing",
                 "Pencil sketch without the edge lines",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sketch_1, in); }});
}

} // namespace pxop
