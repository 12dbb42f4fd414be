#include "operations.hpp"

namespace pxop {

namespace {

// An effect of the shape f(src, &result, ...) -> 1 on success.
template <class Fn, class... A> Image *effect(Fn fn, const Image *in, A... a) {
    Image *out = nullptr;
    if (fn(const_cast<Image *>(in), &out, a...) != 1) {
        free_Image(&out, 0);
        return nullptr;
    }
    return out;
}

std::vector<Operation> build_table() {
    std::vector<Operation> t;
    // Drawing and relief effects.
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
    return t;
}

} // namespace

uint32_t format_of(uint32_t bitCount) {
    switch (bitCount) {
    case 8: return kGray8;
    case 16: return kWord16;
    case 24: return kBgr24;
    case 32: return kBgra32;
    default: return 0;
    }
}

const std::vector<Operation> &operations() {
    static const std::vector<Operation> table = build_table();
    return table;
}

const Operation *find_operation(std::string_view name) {
    for (const Operation &op : operations())
        if (op.name == name) return &op;
    return nullptr;
}

Args default_args(const Operation &op) {
    Args a;
    for (const Param &p : op.params)
        a.values.push_back(p.def);
    return a;
}

Image *convert_to(const Image *in, uint32_t bitCount) {
    Image *out = malloc_Image(in->width, in->height, static_cast<int32_t>(bitCount));
    if (out == nullptr) return nullptr;
    if (bitCount == 8) {
        for (int32_t y = 0; y < in->height; ++y)
            for (int32_t x = 0; x < in->width; ++x)
                out->bits[static_cast<size_t>(y) * out->pitch + x] = GetPixelGray(in, x, y);
    } else {
        PX_Img_Copy(out, in);
    }
    return out;
}

Image *convert_for(const Operation &op, const Image *in) {
    if (op.formats & format_of(in->bitCount)) return convert_to(in, in->bitCount);
    if (in->bitCount == 32 && (op.formats & kBgr24)) return convert_to(in, 24);
    if (op.formats & kBgr24) return convert_to(in, 24);
    if (op.formats & kBgra32) return convert_to(in, 32);
    if (op.formats & kGray8) return convert_to(in, 8);
    return convert_to(in, 16);
}

} // namespace pxop
