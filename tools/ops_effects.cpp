// Table entries of the artistic effects.
#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

using kit::effect;

namespace {

using C = Call<Image>;

// Effects read through the pixel readers, so any bit count works; `keeps`
// marks those whose failed working allocation leaves the prepared result.
// On sources of an empty size most draw nothing into a matching slot (1);
// `empty` names the others.
constexpr const char *kNothingDrawn = "1k 1k 1k 1k";
Contract<Image> slot_effect(std::function<int64_t(C &)> call, const char *empty = kNothingDrawn, bool keeps = false,
                            int32_t typical = 3) {
    return {.formats = kAnyBits,
            .call = std::move(call),
            .keeps_result_on_failure = keeps,
            .typical = typical,
            .empty_sources = empty};
}
Contract<Image> slot_effect(uint32_t (*fn)(Image *, Image **), const char *empty = kNothingDrawn, bool keeps = false) {
    return slot_effect([fn](C &c) { return int64_t(fn(c.a, c.slot)); }, empty, keeps);
}

} // namespace

void add_effects(std::vector<Operation> &t) {
    t.push_back({"neon",
                 PXOP_FN(PX_IMG_Neon),
                 "Drawing",
                 "Edge glow: doubled gradient magnitude per channel",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Neon, in); },
                 slot_effect(PX_IMG_Neon)});
    t.push_back({"emboss",
                 PXOP_FN(PX_IMG_Emboss),
                 "Drawing",
                 "Gray relief from the diagonal difference",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Emboss, in); },
                 slot_effect(PX_IMG_Emboss)});
    t.push_back({"photocopy",
                 PXOP_FN(PX_IMG_Photocopy),
                 "Drawing",
                 "Photocopier look by local contrast thresholds",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Photocopy, in); },
                 slot_effect(PX_IMG_Photocopy, "1k 0r 1k 1k")});
    t.push_back({"sketch",
                 PXOP_FN(PX_IMG_Sketch),
                 "Drawing",
                 "Pencil sketch darkened along edges",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sketch, in); },
                 slot_effect(PX_IMG_Sketch, "0k 0k 0k 1k", true)});
    t.push_back({"sketch-soft",
                 PXOP_FN(PX_IMG_Sketch_1),
                 "Drawing",
                 "Pencil sketch without the edge lines",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Sketch_1, in); },
                 slot_effect(PX_IMG_Sketch_1, "0k 0k 0k 1k", true)});
    t.push_back({"negative",
                 PXOP_FN(PX_IMG_Negative),
                 "Colour tones",
                 "255 minus every channel",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Negative, in); },
                 slot_effect(PX_IMG_Negative)});
    t.push_back({"warm",
                 PXOP_FN(PX_IMG_WARM_YELLOW),
                 "Colour tones",
                 "Warmer: more red, less green and blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_WARM_YELLOW, in); },
                 slot_effect(PX_IMG_WARM_YELLOW)});
    t.push_back({"cold",
                 PXOP_FN(PX_IMG_COLD_PUPRLE),
                 "Colour tones",
                 "Cooler: less red, more blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_COLD_PUPRLE, in); },
                 slot_effect(PX_IMG_COLD_PUPRLE)});
    t.push_back({"old-photo",
                 PXOP_FN(PX_IMG_Classical_Photograph),
                 "Colour tones",
                 "Old photograph tone curves",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Classical_Photograph, in); },
                 slot_effect(PX_IMG_Classical_Photograph)});
    t.push_back({"restore",
                 PXOP_FN(PX_IMG_Repristination),
                 "Colour tones",
                 "Gray tinted toward blue",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Repristination, in); },
                 slot_effect(PX_IMG_Repristination)});
    t.push_back({"scan-lines",
                 PXOP_FN(PX_IMG_Line),
                 "Colour tones",
                 "Rows darkened except every third",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Line, in); },
                 slot_effect(PX_IMG_Line)});
    t.push_back({"blank",
                 PXOP_FN(my),
                 "Colour tones",
                 "Only prepares the result image (white)",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) {
                     Image *out = nullptr;
                     if (my(const_cast<Image *>(in), &out) == 0) free_Image(&out, 0);
                     return out;
                 },
                 slot_effect(my)});
    t.push_back({"light",
                 PXOP_FN(PX_IMG_Light_Alter),
                 "Light",
                 "Scales red, green, blue or all by a percent",
                 {{"percent", true, 0, 400, 140, "100 leaves the picture unchanged"},
                  {"channel", true, 0, 3, 3, "0 red, 1 green, 2 blue, 3 all"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return effect(PX_IMG_Light_Alter, in, static_cast<uint32_t>(a.i(0)),
                                   static_cast<uint32_t>(a.i(1)));
                 },
                 slot_effect([](C &c) { return PX_IMG_Light_Alter(c.a, c.slot, c.p, c.p); })});
    t.push_back({"contrast",
                 PXOP_FN(PX_IMG_Ballance),
                 "Light",
                 "Contrast about mid-gray by a percent",
                 {{"contrast", true, -100, 300, 40, "0 leaves the picture unchanged"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Ballance, in, a.i(0)); },
                 slot_effect([](C &c) { return PX_IMG_Ballance(c.a, c.slot, c.p); })});
    t.push_back({"soft-glow",
                 PXOP_FN(PX_IMG_Lambency),
                 "Light",
                 "Blurred, darkened copy screen-blended over the picture",
                 {},
                 kAllFormats,
                 [](const Image *in, const Args &) { return effect(PX_IMG_Lambency, in); },
                 slot_effect(PX_IMG_Lambency, "0k 0k 0k 0k")});
    t.push_back({"mosaic",
                 PXOP_FN(PX_IMG_Mosaic),
                 "Textures",
                 "Square blocks of one colour",
                 {{"size", true, 1, 256, 12, "block side in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Mosaic, in, a.i(0)); },
                 slot_effect([](C &c) { return PX_IMG_Mosaic(c.a, c.slot, c.p); }, "0k 0k 1k 0k")});
    t.push_back({"watercolour",
                 PXOP_FN(PX_IMG_Aquarelle),
                 "Textures",
                 "Random jitter of pixels",
                 {{"range", true, 1, 64, 5, "largest jitter in pixels"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(PX_IMG_Aquarelle, in, a.i(0)); },
                 slot_effect([](C &c) { return PX_IMG_Aquarelle(c.a, c.slot, c.p); })});
    t.push_back({"oil",
                 PXOP_FN(imOil),
                 "Textures",
                 "Oil painting by the dominant intensity in a window",
                 {{"radius", true, 0, 16, 3, "window radius"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) { return effect(imOil, in, a.i(0)); },
                 slot_effect([](C &c) { return imOil(c.a, c.slot, c.p); }, "0k 0k 0k 0k", true, 1)});
    t.push_back({"oil-poster",
                 PXOP_FN(imOil_1),
                 "Textures",
                 "Posterised oil look from quantised hue and lightness",
                 {},
                 kColour,
                 [](const Image *in, const Args &) { return effect(imOil_1, in); },
                 Contract<Image>{.formats = {24, 32},
                                 .call = [](C &c) { return imOil_1(c.a, c.slot); },
                                 .empty_slot = true,
                                 .falls_back_on_failure = true,
                                 .empty_sources = "0k 0k 0k 0k"}});
    t.push_back({"compress-levels",
                 PXOP_FN(ColorCompress),
                 "Textures",
                 "Quantises an 8-bit plane to frequent levels",
                 {{"levels", true, 1, 256, 8, "number of level groups"}},
                 kGray8,
                 [](const Image *in, const Args &a) {
                     return kit::in_place(in, [&](Image *p) { return ColorCompress(p, a.i(0)) == 1; });
                 },
                 Contract<Image>{.formats = {8},
                                 .call = [](C &c) { return ColorCompress(c.a, c.p); },
                                 .slot = false,
                                 .accepts = kEmptySizes}});
    t.push_back({"channel-shift",
                 PXOP_FN(PX_IMG_Alter),
                 "Colour tones",
                 "Shifts channels and re-curves them",
                 {{"red", true, -127, 127, 40, "red shift"},
                  {"green", true, -127, 127, -20, "green shift"},
                  {"blue", true, -127, 127, 20, "blue shift"},
                  {"mode", true, 0, 6, 5, "0 plain shift, 1-5 curve modes, 6 default mode"}},
                 kAllFormats,
                 [](const Image *in, const Args &a) {
                     return effect(PX_IMG_Alter, in, a.i(0), a.i(1), a.i(2), static_cast<uint32_t>(a.i(3)));
                 },
                 slot_effect([](C &c) { return PX_IMG_Alter(c.a, c.slot, c.p, ~c.p, c.p, c.p); })});
    t.push_back(contract_row(PXOP_FN(PX_ProcessImage), "Drawing",
                             slot_effect([](C &c) { return PX_ProcessImage(c.a, c.slot, c.p); }, "0k 0k 0k 1k", true)));
}

} // namespace pxop
