// Sliding histograms for rank filters: the samples of a window counted per
// level, updated as samples enter and leave the window, and the rank queries
// the filters make on them.
//
// A filter picks the count type that holds its largest window (filters that
// keep one histogram per column use bytes) and the layout its queries need:
// a flat histogram for a tracked rank or a most frequent level, one with
// coarse groups for ranks searched from scratch, which then scan the groups
// first and only one group's levels.
//
// Levels are int32_t: the scans below run until a count is reached rather
// than to a bound, and a signed counter lets the compiler index the bins with
// a widened register instead of extending the counter at every step.
#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

namespace pxfx::rank {

// Count (or sum of weights) per level 0 .. Levels - 1.
template <uint32_t Levels, class Count> struct Histogram {
    static constexpr uint32_t kLevels = Levels;
    Count bins[Levels];

    void reset() { std::memset(bins, 0, sizeof bins); }
    void add(int32_t v, Count w = 1) { bins[v] += w; }
    void remove(int32_t v, Count w = 1) { bins[v] -= w; }
    Count count(int32_t v) const { return bins[v]; }
    // Union with a disjoint window: bin by bin addition.
    void merge(const Histogram &h) {
        for (uint32_t v = 0; v < Levels; ++v)
            bins[v] += h.bins[v];
    }
    // Window moved from `out` to `in` (this += in - out, bin by bin; the
    // difference of unsigned counts wraps back exactly).
    void slide(const Histogram &in, const Histogram &out) {
        Count d[Levels];
        for (uint32_t v = 0; v < Levels; ++v)
            d[v] = static_cast<Count>(in.bins[v] - out.bins[v]);
        for (uint32_t v = 0; v < Levels; ++v)
            bins[v] += d[v];
    }
};

// Levels of a group of a grouped histogram: 2^kGroupShift, the square root
// of the level count rounded down (16 groups of 16 for bytes, 256 of 256 for
// words).
template <uint32_t Levels> inline constexpr int kGroupShift = std::bit_width(Levels - 1) / 2;

// Counts per level and per group of levels. Levels is a power of two.
template <uint32_t Levels, class Count> struct GroupedHistogram {
    static_assert(std::has_single_bit(Levels) && Levels >= 4);
    static constexpr uint32_t kLevels = Levels;
    static constexpr int kShift = kGroupShift<Levels>;
    Count fine[Levels];
    Count coarse[Levels >> kShift];

    void reset() {
        std::memset(fine, 0, sizeof fine);
        std::memset(coarse, 0, sizeof coarse);
    }
    void add(int32_t v) {
        ++fine[v];
        ++coarse[v >> kShift];
    }
    void remove(int32_t v) {
        --fine[v];
        --coarse[v >> kShift];
    }
    Count count(int32_t v) const { return fine[v]; }
    Count group(int32_t g) const { return coarse[g]; }
};

template <class H>
concept Grouped = requires(const H &h) {
    h.group(0);
};

// Two windows taken as one with a single sample left out: the cross windows
// of the median filters, a column and a row that share their centre.
template <class A, class B> struct Cross {
    static constexpr uint32_t kLevels = A::kLevels;
    const A &a;
    const B &b;
    int32_t centre;

    int32_t count(int32_t v) const {
        return static_cast<int32_t>(a.count(v)) + static_cast<int32_t>(b.count(v)) - (v == centre);
    }
    int32_t group(int32_t g) const requires Grouped<A> && Grouped<B> {
        return static_cast<int32_t>(a.group(g)) + static_cast<int32_t>(b.group(g)) -
               (g == centre >> kGroupShift<kLevels>);
    }
};

template <class A, class B> Cross(const A &, const B &, int32_t) -> Cross<A, B>;

// Element k (from 0) of the window sorted smallest first; the window holds
// more than k samples.
template <Grouped H> int32_t kth_smallest(const H &h, uint32_t k) {
    constexpr int shift = kGroupShift<H::kLevels>;
    uint32_t seen = 0;
    int32_t g = 0;
    for (;; ++g) {
        const auto n = static_cast<uint32_t>(h.group(g));
        if (seen + n > k) break;
        seen += n;
    }
    for (int32_t v = g << shift;; ++v) {
        seen += static_cast<uint32_t>(h.count(v));
        if (seen > k) return v;
    }
}

// Element k (from 0) of the window sorted largest first; the window holds
// more than k samples.
template <Grouped H> int32_t kth_largest(const H &h, uint32_t k) {
    constexpr int shift = kGroupShift<H::kLevels>;
    uint32_t seen = 0;
    int32_t g = static_cast<int32_t>(H::kLevels >> shift) - 1;
    for (;; --g) {
        const auto n = static_cast<uint32_t>(h.group(g));
        if (seen + n > k) break;
        seen += n;
    }
    for (int32_t v = ((g + 1) << shift) - 1;; --v) {
        seen += static_cast<uint32_t>(h.count(v));
        if (seen > k) return v;
    }
}

// Number of samples strictly greater than v.
template <Grouped H> uint32_t count_above(const H &h, int32_t v) {
    constexpr int shift = kGroupShift<H::kLevels>;
    const int32_t g = v >> shift;
    uint32_t n = 0;
    for (int32_t i = g + 1; i < static_cast<int32_t>(H::kLevels >> shift); ++i)
        n += static_cast<uint32_t>(h.group(i));
    for (int32_t i = v + 1; i < (g + 1) << shift; ++i)
        n += static_cast<uint32_t>(h.count(i));
    return n;
}

// The level of first .. end - 1 with the largest count, the lowest such level
// on a tie; first < end.
template <class H> int32_t most_frequent(const H &h, int32_t first, int32_t end) {
    // Selects rather than branches: on noisy pictures which level wins is
    // close to random, and a mispredicted branch costs more than the select.
    int32_t best = first;
    auto top = h.count(first);
    for (int32_t v = first + 1; v < end; ++v) {
        const auto c = h.count(v);
        const bool more = c > top;
        best = more ? v : best;
        top = more ? c : top;
    }
    return best;
}

// One rank of a sliding window, tracked rather than searched: the level found
// for the previous window is kept with the number of samples below it, and
// after an update it walks only as far as the window's values moved. Report
// every sample that enters or leaves through added / removed; start from {}
// (level 0, nothing below).
struct Cursor {
    int32_t level;
    int32_t below;

    void added(int32_t v) { below += v < level; }
    void removed(int32_t v) { below -= v < level; }
    // The smallest level whose running count exceeds `rank` in h (a
    // histogram or a Cross of the window); the window holds more than `rank`
    // samples.
    template <class H> int32_t settle(const H &h, int32_t rank) {
        while (below > rank)
            below -= static_cast<int32_t>(h.count(--level));
        while (below + static_cast<int32_t>(h.count(level)) <= rank)
            below += static_cast<int32_t>(h.count(level++));
        return level;
    }
};

} // namespace pxfx::rank
