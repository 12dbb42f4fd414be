// The registry's C interface: a JSON description of the rows and one entry
// point that checks the values and runs a row through pxop::apply, the path
// the command-line tool takes.
#include "operations_capi.h"

#include <cstdio>
#include <exception>
#include <new>
#include <string>

#include "operations.hpp"

namespace {

void append_string(std::string &json, std::string_view text) {
    json += '"';
    for (const char c : text) {
        const auto u = static_cast<unsigned char>(c);
        if (c == '"' || c == '\\') {
            json += '\\';
            json += c;
        } else if (u < 0x20) {
            char buf[8];
            std::snprintf(buf, sizeof buf, "\\u%04x", u);
            json += buf;
        } else {
            json += c;
        }
    }
    json += '"';
}

// Numbers with the digits that read back to the same double.
void append_number(std::string &json, double v) {
    char buf[32];
    std::snprintf(buf, sizeof buf, "%.17g", v);
    json += buf;
}

std::string describe() {
    std::string json = "[";
    for (const pxop::Operation &op : pxop::operations()) {
        if (json.size() > 1) json += ',';
        json += "{\"name\":";
        append_string(json, op.name);
        json += ",\"function\":";
        append_string(json, op.function);
        json += ",\"group\":";
        append_string(json, op.group);
        json += ",\"summary\":";
        append_string(json, op.summary);
        json += ",\"bits\":[";
        const char *sep = "";
        for (const uint32_t bits : {8u, 16u, 24u, 32u})
            if (op.formats & pxop::format_of(bits)) {
                json += sep;
                append_number(json, bits);
                sep = ",";
            }
        json += "],\"same_size\":";
        json += op.sameSize ? "true" : "false";
        json += ",\"params\":[";
        sep = "";
        for (const pxop::Param &p : op.params) {
            json += sep;
            sep = ",";
            json += "{\"name\":";
            append_string(json, p.name);
            json += ",\"integer\":";
            json += p.integer ? "true" : "false";
            json += ",\"min\":";
            append_number(json, p.lo);
            json += ",\"max\":";
            append_number(json, p.hi);
            json += ",\"default\":";
            append_number(json, p.def);
            json += ",\"help\":";
            append_string(json, p.help);
            json += '}';
        }
        json += "]}";
    }
    return json + "]";
}

int fail(int code, const std::string &message, char *error, size_t errorSize) {
    if (errorSize > 0) std::snprintf(error, errorSize, "%s", message.c_str());
    return code;
}

// Why the library would take `in` as a record without pixels, or empty.
std::string record_error(const Image *in) {
    if (in == nullptr || in->bits == nullptr) return "picture without pixels";
    if (in->width <= 0 || in->height <= 0) return "picture of an empty size";
    const uint64_t row = (static_cast<uint64_t>(in->width) * in->bitCount + 7) / 8;
    if (in->pitch < row) return "row pitch below one row of pixels";
    if (static_cast<uint64_t>(in->pitch) * static_cast<uint64_t>(in->height) > INT32_MAX)
        return "picture above 2^31 - 1 bytes";
    return {};
}

} // namespace

extern "C" const char *pxop_describe(void) {
    static const std::string json = describe();
    return json.c_str();
}

extern "C" int pxop_apply(const char *name, const Image *in, const double *values, int count, Image **out, char *error,
                          size_t errorSize) {
    if (out == nullptr) return fail(PXOP_INVALID, "no result slot", error, errorSize);
    *out = nullptr;
    try {
        const pxop::Operation *op = name != nullptr ? pxop::find_operation(name) : nullptr;
        if (op == nullptr)
            return fail(PXOP_INVALID, "unknown operation '" + std::string(name ? name : "") + "'", error, errorSize);
        if (count < 0 || static_cast<size_t>(count) != op->params.size() || (count > 0 && values == nullptr)) {
            char counts[64];
            std::snprintf(counts, sizeof counts, " takes %zu values, not %d", op->params.size(), count);
            return fail(PXOP_INVALID, std::string(op->name) + counts, error, errorSize);
        }
        pxop::Args args;
        for (int k = 0; k < count; ++k) {
            char text[32];
            std::snprintf(text, sizeof text, "%.15g", values[k]);
            const std::string why = pxop::value_error(op->params[k], values[k], text);
            if (!why.empty()) return fail(PXOP_INVALID, std::string(op->name) + ": " + why, error, errorSize);
            args.values.push_back(values[k]);
        }
        if (const std::string why = record_error(in); !why.empty())
            return fail(PXOP_INVALID, std::string(op->name) + ": " + why, error, errorSize);
        std::string why;
        *out = pxop::apply(*op, in, args, &why);
        if (*out != nullptr) return PXOP_OK;
        return fail(why == pxop::kOutOfMemory ? PXOP_NO_MEMORY : PXOP_FAILED, why, error, errorSize);
    } catch (const std::bad_alloc &) {
        return fail(PXOP_NO_MEMORY, std::string(pxop::kOutOfMemory), error, errorSize);
    } catch (const std::exception &e) {
        return fail(PXOP_FAILED, e.what(), error, errorSize);
    }
}
