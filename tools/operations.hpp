// The registry: one row per exported picture function, with its parameters,
// the formats it accepts, its hostile-input contract and how to call it. The
// command-line tool, the gallery, the golden hashes, the contract tests, the
// fuzzers, the export check and the benchmarks all iterate it; adding a
// function means adding one row in the ops_*.cpp file of its subsystem (the
// functions that take no picture are listed in services.cpp).
#pragma once

#include <pxfx/pxfx.h>

#include <cstdint>
#include <string>
#include <string_view>
#include <variant>
#include <vector>

#include "contract.hpp"

// The name of an exported function, taken from the function itself: a name
// the library does not declare does not compile.
#define PXOP_FN(fn) (static_cast<void>(&(fn)), std::string_view{#fn})

namespace pxop {

// Bit of each pixel format in Operation::formats.
enum Format : uint32_t { kGray8 = 1u, kWord16 = 2u, kBgr24 = 4u, kBgra32 = 8u };
inline constexpr uint32_t kColour = kBgr24 | kBgra32;
inline constexpr uint32_t kAllFormats = kGray8 | kWord16 | kBgr24 | kBgra32;

// The format bit of a bit count (0 for bit counts no operation takes).
uint32_t format_of(uint32_t bitCount);

struct Param {
    std::string_view name;
    bool integer;
    double lo, hi, def;
    std::string_view help;
};

// v truncated toward zero and held to the 32-bit range (NaN gives 0), so that
// any value, even one outside a parameter's range, converts safely.
inline int32_t saturate(double v) {
    if (!(v == v)) return 0;
    if (v <= -2147483648.0) return INT32_MIN;
    if (v >= 2147483647.0) return INT32_MAX;
    return static_cast<int32_t>(v);
}

// A parameter value as the tool prints it: whole numbers without decimals.
std::string number_text(double v, bool integer);

// Why `v` is no valid value of `p`, or empty when it is one: a number (not
// NaN), whole for integer parameters, inside lo..hi. `text` is the value as
// the caller wrote it, quoted in the message.
std::string value_error(const Param &p, double v, std::string_view text);

// Parameter values in the order of Operation::params.
struct Args {
    std::vector<double> values;
    int32_t i(size_t k) const { return saturate(values[k]); }
    float f(size_t k) const { return static_cast<float>(values[k]); }
};

using AnyContract = std::variant<std::monostate, Contract<Image>, Contract<PXImage>>;

struct Operation {
    std::string_view name;     // command-line name; empty for rows without one
    std::string_view function; // the C function behind it (PXOP_FN)
    std::string_view group;
    std::string_view summary;
    std::vector<Param> params;
    uint32_t formats; // Format bits the operation accepts
    // Runs on `in` (of an accepted format); returns a new image the caller
    // releases with free_Image, or null when the operation failed.
    Image *(*run)(const Image *in, const Args &args);
    // What the function promises on hostile input.
    AnyContract contract = {};
    // False for operations whose result has another size than their input.
    bool sameSize = true;
};

// Every row; operations() keeps those the tool runs (with a name).
const std::vector<Operation> &registry();
const std::vector<Operation> &operations();

// A row for a function the tool does not run: its contract only.
template <class R> Operation contract_row(std::string_view function, std::string_view group, Contract<R> c) {
    return {{}, function, group, {}, {}, 0, nullptr, std::move(c)};
}

// Names of the exported functions that take no picture (memory, files,
// math, tables), kept beside the registry.
const std::vector<std::string_view> &service_functions();
const Operation *find_operation(std::string_view name);

// The default arguments of an operation.
Args default_args(const Operation &op);

// A new copy of `in` in the format the operation takes: the same format when
// accepted, else 32 or 24 bits for colour operations, 8-bit luma otherwise.
Image *convert_for(const Operation &op, const Image *in);

// A new copy of `in` at `bitCount` (8-bit copies hold the luma).
Image *convert_to(const Image *in, uint32_t bitCount);

// Runs `op` on `in` the way every front end does: on `in` itself when the
// operation takes its format, else on a copy made by convert_for. Returns the
// new result, or null with the reason in *error (kOutOfMemory when the copy
// could not be made).
inline constexpr std::string_view kOutOfMemory = "out of memory";
Image *apply(const Operation &op, const Image *in, const Args &args, std::string *error);

} // namespace pxop
