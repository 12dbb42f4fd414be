// What a function of the registry promises on hostile input, and how to call
// it with the pictures, slot and parameter a check or a fuzzer chooses. The
// contract tests feed every row broken records, pictures of mismatched sizes,
// extreme parameters and failing allocations; the fuzzers feed it random ones.
#pragma once

#include <pxfx/pxfx.h>

#include <algorithm>
#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace pxop {

// What one call sees.
template <class R> struct Call {
    R *a = nullptr;   // first picture
    R *b = nullptr;   // second picture (two-picture functions)
    R *out = nullptr; // the picture the function returned or put in the slot
    R **slot = &out;  // the result slot handed to the function
    int32_t p = 0;    // the parameter under test, passed for every parameter
};

// The failure result of functions that return nothing.
inline constexpr int64_t kNoResult = INT64_MIN;
// A result a contract does not pin.
inline constexpr int64_t kUnpinned = INT64_MIN + 1;

// A degenerate record a function works on without refusing, reading no
// pixels: its kind ("null pixels", "zero width", "negative height",
// "INT_MIN width", "negative sizes", "pitch below a row", "zero pitch",
// "bit count N"; "second: ..." for b), what the call returns for it (unless
// pinned here, the contract's `done`), and whether a record without a pixel
// block gives the result and picture of the same record with an all-zero
// block, as the pixel readers read a missing block as 0.
//
// The result picture is described by its shape: "null", or "WxHxB" (width,
// height, bit count) and its block: "none" without one, "zeros" or "white"
// when every byte it claims is 0 or 255, else "pixels"; "kept" for a
// function working in place means its picture is left as it was.
struct Accepted {
    std::string what;
    int64_t result = kUnpinned;
    bool reads_as_zeros = true;
    const char *shape = nullptr; // the result picture (null: not pinned)
    Accepted(const char *kind) : what(kind) {}
    Accepted(std::string kind, int64_t r, bool zeros = true)
        : what(std::move(kind)), result(r), reads_as_zeros(zeros) {}
};
inline Accepted shaped(const char *kind, const char *shape) {
    Accepted a(kind);
    a.shape = shape;
    return a;
}

// The kind named `what` among `kinds`, or null.
inline const Accepted *find_kind(const std::vector<Accepted> &kinds, const std::string &what) {
    const auto it = std::find_if(kinds.begin(), kinds.end(), [&](const Accepted &a) { return a.what == what; });
    return it == kinds.end() ? nullptr : &*it;
}

// A record of another size over a noise block of the first accepted bit
// count (or of `bits` when set; or over none), called with the typical
// parameter: what it returns and, where pinned, the shape of the result. A
// failure result means refused.
struct Sized {
    int32_t w, h;
    bool pixels;
    int64_t result;
    const char *shape = nullptr;
    int32_t bits = 0;
};

// A function "refuses" when it returns its failure result, leaves its result
// slot empty and changes none of its inputs (records and pixel bytes).
template <class R> struct Contract {
    std::vector<int32_t> formats;           // bit counts of the first picture it works on
    std::function<int64_t(Call<R> &)> call; // runs the function, returns its result
    int64_t failure = 0;                    // its failure result (kNoResult for void functions)
    int pictures = 1;                       // pictures it reads: a, then b
    std::vector<int32_t> formats_b;         // bit counts of b (empty: as a)
    bool slot = true;                       // a null result slot is refused
    bool empty_slot = false;                // the slot must be empty: what it holds is not released
    bool mismatch_fails = false;            // pictures of different sizes are refused
    bool keeps_result_on_failure = false;   // a failed working allocation leaves the prepared result
    int32_t typical = 3;                    // an ordinary parameter value
    bool falls_back_on_failure = false;     // short of memory it finishes another, documented way
    // Degenerate records it works on without refusing, and what it returns for
    // them (functions without a result return 1: done, nothing to do).
    std::vector<Accepted> accepts;
    int64_t done = 1;
    std::vector<Sized> sizes; // small and empty sizes at the edges of its windows
    // Functions filling a caller's slot: for sources of an empty size (zero
    // width, INT_MIN width, negative height, both negative) holding a
    // matching record in the slot, the result digit and what became of the
    // record: kept (k), cleared over the block it claims (z), given the
    // source's block (c) or released (r). Null: no such slot.
    const char *empty_sources = nullptr;
    // The same function called another way (for example in place, with a
    // null slot), held to the same promises.
    std::function<int64_t(Call<R> &)> also;

    const Accepted *accepted(const std::string &what) const { return find_kind(accepts, what); }
};

// A rectangle and a point following the parameter, and the address of such a
// value for the duration of a call.
inline PXRect rect(int32_t p) { return {1, p, p, 0}; }
inline PXPoint point(int32_t p) { return {p, p}; }
template <class T> const T *ptr(const T &v) { return &v; }

// Bit counts the pixel readers take: any (unknown ones read as opaque black).
inline const std::vector<int32_t> kAnyBits = {8, 16, 24, 32, 0, 1, 4, 12, 48};
// Records of no pixel rows that a function with nothing to visit takes as
// done, and those and a record without a pixel block.
inline const std::vector<Accepted> kEmptySizes = {"zero width", "negative height", "INT_MIN width", "negative sizes"};
inline const std::vector<Accepted> kPixelless = {"null pixels", "zero width", "negative height", "INT_MIN width",
                                                 "negative sizes"};

// The kinds given, accepted in the first picture and in the second.
inline std::vector<Accepted> in_both(const std::vector<Accepted> &kinds) {
    std::vector<Accepted> v = kinds;
    for (const Accepted &a : kinds) {
        v.push_back(a);
        v.back().what = "second: " + a.what;
    }
    return v;
}

} // namespace pxop
