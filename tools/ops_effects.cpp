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
    t.push_back({"negative",
                 "PX_IMG_Negative",
                 "Colour tones",
                 "255 minus every channel",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Negative, in); }});
    t.push_back({"warm",
                 "PX_IMG_WARM_YELLOW",
                 "Colour tones",
                 "Warmer: more red, less green and blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_WARM_YELLOW, in); }});
    t.push_back({"cold",
                 "PX_IMG_COLD_PUPRLE",
                 "Colour tones",
                 "Cooler: less red, more blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_COLD_PUPRLE, in); }});
    t.push_back({"old-photo",
                 "PX_IMG_Classical_Photograph",
                 "Colour tones",
                 "Old photograph tone curves",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Classical_Photograph, in); }});
    t.push_back({"restore",
                 "PX_IMG_Repristination",
                 "Colour tones",
                 "Gray tinted toward blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Repristination, in); }});
    t.push_back({"scan-lines",
                 "PX_IMG_Line",
                 "Colour tones",
                 "Rows darkened except every third",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Line, in); }});
    t.push_back({"blank",
                 "my",
                 "Colour tones",
                 "Only prepares the result image (white)",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) {
                     Image *out = nullptr;
                     if (my(const_cast<Image *>(in), &out) == 0) free_Image(&out, 0);
                     return out;
                 }});
    t.push_back({"light",
                 "PX_IMG_Light_Alter",
                 "Light",
                 "Scales red, green, blue or all by a percent",
                 {{"percent", true, 0, 400, 140, "100 leaves the picture unchanged"},
                  {"channel", true, 0, 3, 3, "0 red, 1 green, 2 blue, 3 all"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return effect(PX_IMG_Light_Alter, in, static_cast<uint32_t>(a.i(0)),
                                   static_cast<uint32_t>(a.i(1)));
                 }});
    t.push_back({"contrast",
                 "PX_IMG_Ballance",
                 "Light",
                 "Contrast about mid-gray by a percent",
                 {{"contrast", true, -100, 300, 40, "0 leaves the picture unchanged"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Ballance, in, a.i(0)); }});
    t.push_back({"soft-glow",
                 "PX_IMG_Lambency",
                 "Light",
                 "Blurred, darkened copy screen-blended over the picture",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Lambency, in); }});
    t.push_back({"mosaic",
                 "PX_IMG_Mosaic",
                 "Textures",
                 "Square blocks of one colour",
                 {{"size", true, 1, 256, 12, "block side in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Mosaic, in, a.i(0)); }});
    t.push_back({"watercolour",
                 "PX_IMG_Aquarelle",
                 "Textures",
                 "Random jitter of pixels",
                 {{"range", true, 1, 64, 5, "largest jitter in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Aquarelle, in, a.i(0)); }});
    t.push_back({"oil",
                 "imOil",
                 "Textures",
                 "Oil painting by the dominant intensity in a window",
                 {{"radius", true, 0, 16, 3, "window radius"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(imOil, in, a.i(0)); }});
    t.push_back({"oil-poster",
                 "imOil_1",
                 "Textures",
                 "Posterised oil look from quantised hue and lightness",
                 {},
                 kColour,
                 [](const Image *in, const Args &) { return effect(imOil_1, in); }});
    t.push_back({"compress-levels",
                 "ColorCompress",
                 "Textures",
                 "Quantises an 8-bit plane to frequent levels",
                 {{"levels", true, 1, 256, 8, "number of level groups"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return kit::in_place(in, [&](Image *p) { return ColorCompress(p, a.i(0)) == 1; });
                 }});
    t.push_back({"channel-shift",
                 "PX_IMG_Alter",
                 "Colour tones",
                 "Shifts channels and re-curves them",
                 {{"red", true, -127, 127, 40, "red shift"},
                  {"green", true, -127, 127, -20, "green shift"},
                  {"blue", true, -127, 127, 20, "blue shift"},
                  {"mode", true, 0, 6, 5, "0 plain shift, 1-5 curve modes, 6 default mode"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return effect(PX_IMG_Alter, in, a.i(0), a.i(1), a.i(2), static_cast<uint32_t>(a.i(3)));
                 }});
}

} // namespace pxop
