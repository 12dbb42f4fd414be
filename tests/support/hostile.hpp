// Hostile-input checks. The registry's contract of each picture function says
// which bit counts it accepts, how many pictures it reads and what it returns
// on failure; the checks below feed it every kind of broken record, pictures
// of mismatched sizes, extreme parameters and failing allocations.
//
// A function "refuses" when it returns its failure result, leaves its result
// slot empty and changes none of its inputs (records and pixel bytes). Every
// record, good or broken, points at a block of exactly the bytes it claims
// (or at a small block when the claim is huge), so a function that reads
// without checking is caught by the sanitizers.
#pragma once

#include "support/alloc_failures.hpp"
#include "support/slot_rule.hpp"
#include "tools/contract.hpp"

namespace pxtest::hostile {

// A caller's record with the block it points at.
template <class R> struct Held {
    std::string what;
    R record{};
    std::vector<uint8_t> block;
    // Record and pixel bytes, to prove a call changed nothing.
    std::vector<uint8_t> snapshot() const {
        std::vector<uint8_t> s(sizeof(R) + block.size());
        std::memcpy(s.data(), &record, sizeof(R));
        std::copy(block.begin(), block.end(), s.begin() + sizeof(R));
        return s;
    }
};
template <class R> using HeldPtr = std::unique_ptr<Held<R>>;

inline std::vector<uint8_t> noise(size_t bytes, uint32_t seed) {
    std::mt19937 rng(seed);
    std::vector<uint8_t> v(bytes);
    std::generate(v.begin(), v.end(), [&rng] { return static_cast<uint8_t>(rng() >> 24); });
    return v;
}

// Rows padded to 4 bytes, as malloc_Image lays them out (4 bytes for bit counts
// without a row size).
inline uint32_t padded_pitch(int64_t width, uint32_t bitCount) {
    const uint64_t bits = static_cast<uint64_t>(width > 0 ? width : 1) * (bitCount ? bitCount : 8);
    return static_cast<uint32_t>(((bits + 31) / 32) * 4);
}

// A record of w x h over a block of `bytes` noise bytes (none for 0); the
// pitch is that of Image records.
template <class R>
HeldPtr<R> held(std::string what, int32_t w, int32_t h, int32_t bitCount, uint32_t pitch, size_t bytes, uint32_t seed) {
    auto r = std::make_unique<Held<R>>();
    r->what = std::move(what);
    r->block = noise(bytes, seed);
    uint8_t *pixels = bytes ? r->block.data() : nullptr;
    if constexpr (std::is_same_v<R, Image>)
        r->record = Image{w, h, uint32_t(bitCount), pixels, pitch, 0};
    else
        r->record = PXImage{w, h, bitCount, pixels};
    return r;
}

// A usable picture of w x h at a bit count, filled with noise.
template <class R> HeldPtr<R> good(int32_t w, int32_t h, int32_t bitCount, uint32_t seed) {
    const uint32_t pitch = padded_pitch(w, uint32_t(bitCount));
    const size_t row = std::is_same_v<R, Image> ? pitch : size_t(w) * std::max(1, (bitCount + 7) / 8);
    return held<R>("good", w, h, bitCount, pitch, row * h, seed);
}

inline constexpr int32_t kBitCountsTried[] = {0, 1, 4, 8, 12, 16, 24, 32, 48};

// Every broken record for a function working on the given bit counts: null
// pixels, zero, negative and overflowing sizes, pitches below a row (Image
// records), and each bit count it does not accept.
template <class R> std::vector<HeldPtr<R>> broken(const std::vector<int32_t> &formats) {
    const int32_t bc = formats.front();
    std::vector<HeldPtr<R>> v;
    for (int32_t other : kBitCountsTried)
        if (std::find(formats.begin(), formats.end(), other) == formats.end()) {
            v.push_back(good<R>(9, 7, other, 1));
            v.back()->what = "bit count " + std::to_string(other);
        }
    const bool image = std::is_same_v<R, Image>;
    const uint32_t row = padded_pitch(9, uint32_t(bc)), low = uint32_t(9 * bc / 8 - 1);
    const size_t rows = image ? size_t(row) * 7 : size_t(9) * 7 * std::max(1, (bc + 7) / 8);
    const struct {
        const char *what;
        int32_t w, h;
        uint32_t pitch;
        size_t bytes;
    } kinds[] = {{"null pixels", 9, 7, row, 0},
                 {"zero width", 0, 7, row, rows},
                 {"negative height", 9, -7, row, 64},
                 {"INT_MIN width", INT_MIN, 7, row, image ? rows : 64},
                 {"negative sizes", -3, -2, row, 64},
                 {"block over 2^32 bytes", 65536, 65536, padded_pitch(65536, uint32_t(bc)), 64},
                 {"INT_MAX height", 9, INT_MAX, row, 64},
                 {"pitch below a row", 9, 7, low, size_t(low) * 7},
                 {"zero pitch", 9, 7, 0, 64}};
    // The pitches are Image records' only; rows below a byte have no shorter one.
    for (uint32_t i = 0; i < std::size(kinds); ++i)
        if (i < 7 || (image && (i == 8 || bc >= 8)))
            v.push_back(held<R>(kinds[i].what, kinds[i].w, kinds[i].h, bc, kinds[i].pitch, kinds[i].bytes, i));
    return v;
}

using pxop::Accepted;
using pxop::Call;
using pxop::Contract;
using pxop::kNoResult;

inline constexpr int32_t kExtremes[] = {INT_MIN, -70000, -256, -1, 0, 1, 2, 255, 256, 70000, INT_MAX};

// Size, bit count and pixel block of a picture (empty for none), field by
// field: the padding between a record's fields holds nothing to compare.
template <class R> std::vector<uint8_t> picture_bytes(const R *im) {
    if (im == nullptr) return {};
    std::vector<uint8_t> v;
    auto put = [&v](uint32_t x) {
        for (int s = 0; s < 32; s += 8)
            v.push_back(static_cast<uint8_t>(x >> s));
    };
    size_t bytes;
    const uint8_t *pixels;
    if constexpr (std::is_same_v<R, Image>) {
        for (uint32_t x : {uint32_t(im->width), uint32_t(im->height), im->bitCount, im->pitch, im->tag})
            put(x);
        bytes = im->bits && im->height > 0 ? size_t(im->pitch) * size_t(im->height) : 0, pixels = im->bits;
    } else {
        for (int32_t x : {im->width, im->height, im->bitcount})
            put(uint32_t(x));
        const int64_t count = int64_t(im->width) * im->height; // two negative sizes make a block too
        bytes = im->data && count > 0 ? size_t(count) * size_t(std::max(im->bitcount / 8, 0)) : 0;
        pixels = im->data;
    }
    v.push_back(pixels != nullptr);
    v.insert(v.end(), pixels, pixels + bytes);
    return v;
}

template <class R> struct Runner {
    const Contract<R> &c;
    std::string name;
    // What one call gave: its result and the bytes of the picture it made.
    struct Outcome {
        int64_t result;
        std::vector<uint8_t> picture;
        std::string shape;
        bool made() const { return shape != "null"; }
    };
    // Calls the function and releases its result.
    Outcome run(R *a, R *b, int32_t p, bool nullSlot = false) {
        Call<R> call{a, b};
        call.p = p;
        if (nullSlot) call.slot = nullptr;
        const int64_t r = c.call(call);
        Outcome o{r, picture_bytes(call.out), shape_of(call.out)};
        if constexpr (std::is_same_v<R, Image>)
            free_Image(&call.out, 0);
        else
            PXImage_Free(call.out);
        return o;
    }
    void expect_refused(R *a, R *b, bool nullSlot, const std::vector<const Held<R> *> &inputs, const std::string &why) {
        std::vector<std::vector<uint8_t>> before;
        for (auto *h : inputs)
            before.push_back(h->snapshot());
        const auto o = run(a, b, c.typical, nullSlot);
        if (c.failure != kNoResult) {
            EXPECT_EQ(o.result, c.failure) << name << ": " << why;
        }
        EXPECT_FALSE(o.made()) << name << ": " << why;
        for (size_t i = 0; i < inputs.size(); ++i)
            EXPECT_TRUE(inputs[i]->snapshot() == before[i]) << name << ": " << why << " changed an input";
    }
    int32_t format_b(int32_t fa) const { return c.formats_b.empty() ? fa : c.formats_b.front(); }
};

// Null records, broken records in every picture position and (where refused)
// a null slot or pictures of different sizes: each refused.
template <class R> void expect_refusals(const std::string &name, const Contract<R> &c) {
    Runner<R> run{c, name};
    const int32_t fa = c.formats.front(), fb = run.format_b(fa);
    auto a = good<R>(9, 7, fa, 11), b = good<R>(9, 7, fb, 12);
    R *second = c.pictures > 1 ? &b->record : nullptr;
    run.expect_refused(nullptr, second, false, {b.get()}, "null first picture");
    for (auto &bad : broken<R>(c.formats))
        if (!c.accepted(bad->what)) run.expect_refused(&bad->record, second, false, {bad.get(), b.get()}, bad->what);
    if (c.pictures > 1) {
        run.expect_refused(&a->record, nullptr, false, {a.get()}, "null second picture");
        for (auto &bad : broken<R>(c.formats_b.empty() ? c.formats : c.formats_b))
            if (!c.accepted("second: " + bad->what))
                run.expect_refused(&a->record, &bad->record, false, {a.get(), bad.get()}, "second: " + bad->what);
        if (c.mismatch_fails) {
            auto odd = good<R>(5, 11, fb, 13);
            run.expect_refused(&a->record, &odd->record, false, {a.get(), odd.get()}, "pictures of different sizes");
        }
    }
    if (c.slot) run.expect_refused(&a->record, second, true, {a.get(), b.get()}, "null slot");
}

// Every accepted bit count at awkward sizes, with the parameter at extremes
// and pictures of different sizes: nothing to check but that memory stays
// whole (the sanitizer build) and the call returns.
template <class R> void expect_extremes_survive(const std::string &name, const Contract<R> &c) {
    Runner<R> run{c, name};
    const std::pair<int32_t, int32_t> sizes[] = {{1, 1}, {2, 5}, {9, 7}};
    for (int32_t fa : c.formats) {
        const int32_t fb = c.formats_b.empty() ? fa : c.formats_b.front();
        for (auto [w, h] : sizes) {
            auto a = good<R>(w, h, fa, 21), b = good<R>(w, h, fb, 22);
            for (int32_t p : kExtremes)
                run.run(&a->record, c.pictures > 1 ? &b->record : nullptr, p);
        }
        if (c.pictures > 1) {
            auto a = good<R>(9, 7, fa, 23), b = good<R>(4, 12, fb, 24);
            run.run(&a->record, &b->record, c.typical);
            run.run(&b->record, &a->record, c.typical);
        }
    }
}

// Each allocation of an ordinary call failing in turn: the call either makes
// exactly what a full run makes, or fails: its failure result, no picture and
// its inputs as they were (void functions may only do either). Random draws
// are seeded alike for every run. Leaks are the leak sanitizer's to find.
template <class R> void expect_allocation_failures_handled(const std::string &name, const Contract<R> &c) {
    if (!pxfx::alloc::injection_available()) return;
    Runner<R> run{c, name};
    for (const int32_t fa : c.formats) {
        SCOPED_TRACE(fa);
        auto a = good<R>(9, 7, fa, 31), b = good<R>(9, 7, run.format_b(fa), 32);
        const auto a0 = a->block, b0 = b->block, sa = a->snapshot(), sb = b->snapshot();
        auto attempt = [&] {
            std::copy(a0.begin(), a0.end(), a->block.begin());
            std::copy(b0.begin(), b0.end(), b->block.begin());
            srand48(7);
            return run.run(&a->record, c.pictures > 1 ? &b->record : nullptr, c.typical);
        };
        const auto full = attempt();
        const auto fullA = a->snapshot(), fullB = b->snapshot();
        sweep_allocation_failures([&] {
            const auto o = attempt();
            if (c.falls_back_on_failure) return;
            const bool same = o.result == full.result && o.picture == full.picture && a->snapshot() == fullA &&
                              b->snapshot() == fullB;
            const bool failed = (c.failure == kNoResult || o.result == c.failure) &&
                                (c.keeps_result_on_failure || !o.made()) && a->snapshot() == sa && b->snapshot() == sb;
            EXPECT_TRUE(same || failed) << name << ": short of memory, neither a full run nor a clean failure (result "
                                        << o.result << ", full run " << full.result << (o.made() ? ", a picture" : "")
                                        << (a->snapshot() == sa ? "" : ", first picture changed") << ")";
        });
    }
}

template <class R> R without_pixels(R r) {
    if constexpr (std::is_same_v<R, Image>)
        r.bits = nullptr;
    else
        r.data = nullptr;
    return r;
}

// A call on `h` pinned to a shape: that of its result, or "kept" for `h` as
// it was before the call.
template <class R>
void expect_shape(const char *want, const std::string &shape, const Held<R> &h, const std::vector<uint8_t> &before,
                  const std::string &why) {
    if (want == nullptr) return;
    EXPECT_EQ(std::string(want) == "kept" ? (h.snapshot() == before ? "kept" : "changed") : shape, want) << why;
}

// Accepted degenerate records in either picture position: the result and
// shape the contract gives, and for a record without a pixel block, the
// result, picture and other picture of the same record with an all-zero block.
template <class R> void expect_accepted_outcomes(const std::string &name, const Contract<R> &c) {
    Runner<R> run{c, name};
    const int32_t fa = c.formats.front(), fb = run.format_b(fa);
    for (const bool second : {false, true}) {
        if (second && c.pictures < 2) break;
        auto call = [&](R *degenerate, int32_t otherBits, std::vector<uint8_t> *otherAfter = nullptr) {
            auto other = good<R>(9, 7, otherBits, 41);
            R *o = c.pictures > 1 ? &other->record : nullptr;
            const auto out = second ? run.run(o, degenerate, c.typical) : run.run(degenerate, o, c.typical);
            if (otherAfter) *otherAfter = other->block;
            return out;
        };
        for (auto &bad : broken<R>(second ? std::vector<int32_t>{fb} : c.formats)) {
            const Accepted *acc = c.accepted(second ? "second: " + bad->what : bad->what);
            if (acc == nullptr) continue;
            const auto before = bad->snapshot();
            const auto o = call(&bad->record, second ? fa : fb);
            if (c.failure != kNoResult) {
                EXPECT_EQ(o.result, acc->result != pxop::kUnpinned ? acc->result : c.done) << name << ": " << acc->what;
            }
            expect_shape(acc->shape, o.shape, *bad, before, name + ": " + acc->what);
        }
        // Without a pixel block, at every bit count (beside every bit count of
        // the first picture): as with an all-zero block.
        const Accepted *none = c.accepted(second ? "second: null pixels" : "null pixels");
        if (none == nullptr || !none->reads_as_zeros) continue;
        for (const int32_t bc : second ? (c.formats_b.empty() ? c.formats : c.formats_b) : c.formats)
            for (const int32_t ob : second ? c.formats : std::vector<int32_t>{fb}) {
                auto zeros = good<R>(9, 7, bc, 0);
                std::fill(zeros->block.begin(), zeros->block.end(), 0);
                R hollow = without_pixels(zeros->record);
                std::vector<uint8_t> otherH, otherZ;
                const auto o = call(&hollow, ob, &otherH), z = call(&zeros->record, ob, &otherZ);
                EXPECT_TRUE(o.result == z.result && o.picture == z.picture && otherH == otherZ)
                    << name << ": " << none->what << " at " << bc << " bits beside " << ob
                    << ", not as an all-zero block";
            }
    }
}

// Records of the contract's other sizes, over a block for every pixel they
// claim: the result, a refusal as such, and the shape.
template <class R> void expect_sizes(const std::string &name, const Contract<R> &c) {
    Runner<R> run{c, name};
    auto b = good<R>(9, 7, run.format_b(c.formats.front()), 52);
    auto side = [](int32_t n) { return int32_t(std::clamp<int64_t>(std::llabs(n), 1, 1024)); };
    for (const pxop::Sized &k : c.sizes) {
        const std::string why = name + ": " + std::to_string(k.w) + "x" + std::to_string(k.h);
        auto held = good<R>(side(k.w), side(k.h), k.bits ? k.bits : c.formats.front(), 51);
        held->record.width = k.w, held->record.height = k.h;
        if (!k.pixels) held->record = without_pixels(held->record);
        R *second = c.pictures > 1 ? &b->record : nullptr;
        if (k.result == c.failure) {
            run.expect_refused(&held->record, second, false, {held.get(), b.get()}, why);
            continue;
        }
        const auto before = held->snapshot();
        const auto o = run.run(&held->record, second, c.typical);
        EXPECT_EQ(o.result, k.result) << why;
        expect_shape(k.shape, o.shape, *held, before, why);
    }
}

// All the checks for a function, and for its other way of being called.
template <class R> void check_contract(const std::string &name, const Contract<R> &c) {
    expect_refusals(name, c);
    expect_accepted_outcomes(name, c);
    expect_sizes(name, c);
    expect_extremes_survive(name, c);
    expect_allocation_failures_handled(name, c);
    if constexpr (std::is_same_v<R, Image>) {
        if (c.empty_sources) {
            auto call = [&c](Image *s, Image **d) {
                Call<Image> k{s};
                k.slot = d, k.p = c.typical;
                return uint32_t(c.call(k));
            };
            expect_slot_rule({name.c_str(), call, c.empty_sources, !c.empty_slot});
        }
    }
    if (c.also) {
        Contract<R> other = c;
        other.call = c.also, other.also = nullptr, other.slot = false, other.empty_sources = nullptr;
        check_contract(name + " (other call)", other);
    }
}

} // namespace pxtest::hostile
