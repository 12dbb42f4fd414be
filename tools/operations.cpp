#include "operations.hpp"

#include <algorithm>
#include <cmath>
#include <cstdio>

#include "operation_groups.hpp"
#include "operation_kit.hpp"

namespace pxop {

namespace {

std::vector<Operation> build_table() {
    std::vector<Operation> t;
    add_effects(t);
    add_color(t);
    add_deform(t);
    add_toolkit(t);
    add_retouch(t);
    add_lines(t);
    add_core(t);
    // Keep each group together, groups in the order they first appear.
    std::vector<std::string_view> groups;
    for (const Operation &op : t)
        if (std::find(groups.begin(), groups.end(), op.group) == groups.end()) groups.push_back(op.group);
    auto rank = [&](const Operation &op) { return std::find(groups.begin(), groups.end(), op.group) - groups.begin(); };
    std::stable_sort(t.begin(), t.end(), [&](const Operation &a, const Operation &b) { return rank(a) < rank(b); });
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

const std::vector<Operation> &registry() {
    static const std::vector<Operation> table = build_table();
    return table;
}

const std::vector<Operation> &operations() {
    static const std::vector<Operation> runnable = [] {
        std::vector<Operation> t;
        for (const Operation &op : registry())
            if (!op.name.empty()) t.push_back(op);
        return t;
    }();
    return runnable;
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

std::string number_text(double v, bool integer) {
    char buf[64];
    std::snprintf(buf, sizeof buf, integer ? "%.0f" : "%g", v);
    return buf;
}

std::string value_error(const Param &p, double v, std::string_view text) {
    const std::string name(p.name), quoted(text);
    if (v != v) return name + ": not a number: " + quoted;
    if (p.integer && std::trunc(v) != v) return name + ": not a whole number: " + quoted;
    if (v < p.lo || v > p.hi)
        return name + ": " + quoted + " is outside " + number_text(p.lo, p.integer) + ".." +
               number_text(p.hi, p.integer);
    return {};
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
    if (op.formats & kBgr24) return convert_to(in, 24);
    if (op.formats & kBgra32) return convert_to(in, 32);
    if (op.formats & kGray8) return convert_to(in, 8);
    return convert_to(in, 16);
}

Image *apply(const Operation &op, const Image *in, const Args &args, std::string *error) {
    Image *result = nullptr;
    if (op.formats & format_of(in->bitCount)) {
        result = op.run(in, args);
    } else {
        Image *ready = convert_for(op, in);
        if (ready == nullptr) {
            *error = kOutOfMemory;
            return nullptr;
        }
        result = op.run(ready, args);
        free_Image(&ready, 0);
    }
    if (result == nullptr) *error = std::string(op.name) + " failed on this picture";
    return result;
}

namespace kit {

PXImage *to_packed(const Image *in) {
    const uint32_t bytes = in->bitCount / 8;
    auto *p = static_cast<PXImage *>(PX_malloc(sizeof(PXImage)));
    if (p == nullptr) return nullptr;
    const size_t row = static_cast<size_t>(in->width) * bytes;
    p->width = in->width;
    p->height = in->height;
    p->bitcount = static_cast<int32_t>(in->bitCount);
    p->data = static_cast<uint8_t *>(PX_malloc(row * in->height));
    if (p->data == nullptr) {
        PX_free(p);
        return nullptr;
    }
    for (int32_t y = 0; y < in->height; ++y)
        std::memcpy(p->data + row * y, in->bits + static_cast<size_t>(y) * in->pitch, row);
    return p;
}

Image *from_packed(const PXImage *in) {
    if (in == nullptr || in->data == nullptr || in->width <= 0 || in->height <= 0) return nullptr;
    Image *out = malloc_Image(in->width, in->height, in->bitcount);
    if (out == nullptr || out->bitCount != static_cast<uint32_t>(in->bitcount)) {
        free_Image(&out, 0);
        return nullptr;
    }
    const size_t row = static_cast<size_t>(in->width) * (out->bitCount / 8);
    for (int32_t y = 0; y < in->height; ++y)
        std::memcpy(out->bits + static_cast<size_t>(y) * out->pitch, in->data + row * y, row);
    return out;
}

} // namespace kit

} // namespace pxop
