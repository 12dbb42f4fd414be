// The 5 x 5 median of byte samples in vectors, and the cross median of the
// line filters. The window's five columns are
// sorted first, once per row for every sample (each column serves five
// results); then the values of equal rank across the window's columns are
// sorted. Each value of the resulting 5 x 5 table then has every value above
// and to the left of it below it, which leaves 6 values certainly below the
// median, 6 certainly above it, and the median as the middle one of the 13
// others. The median of 25 values is unique, so the result is the plain
// network's byte for byte.
#ifndef PXFX_PORTABLE_ONLY

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "toolkit/median_vector.cpp"
#include <hwy/foreach_target.h> // IWYU pragma: keep
#include <hwy/highway.h>

#include <algorithm>
#include <cstring>
#include <utility>

#include "core/internal/vector_kernels.hpp"
#include "toolkit/select_network.hpp"

#ifndef PXFX_MEDIAN_VECTOR_NETWORK
#define PXFX_MEDIAN_VECTOR_NETWORK

namespace pxfx {

namespace {

// The compare-exchanges after the column sort over 25 wires (wire 5 * r + c
// holds rank r of window column c): the sort of every rank across the
// columns, then the selection of the middle of the 13 undecided values.
// That selection starts as the generic network for 13 values; as the 13 are
// partly ordered already (the table's rows and columns are sorted), each of
// its comparators in turn is dropped when the median still comes out right
// without it, and then the comparators that cannot reach the result go too.
// "Comes out right" is checked on 0/1 values (a network that selects the
// median of every 0/1 input of a kind selects it for all inputs of that
// kind, as thresholds commute with min and max): the 252 tables of 0s and
// 1s with sorted rows and columns. The whole network, rank sorts included,
// is checked again on all 6^5 inputs whose columns are sorted (`proven`).
struct Median25Network {
    using Op = CompareOp;
    static constexpr int kMax = 5 * 9 + 64;
    Op ops[kMax] = {};
    int count = 0;
    int out = 0;
    bool proven = false;

    // Bit i of a wire's set: its value in the i-th 0/1 input of a family.
    template <int W> struct Bits {
        uint64_t w[W] = {};
    };

    // Runs ops[0 .. n) over the wires' bit sets (min is and, max is or) and
    // tells whether wire `out` ends as `median`.
    template <int W>
    static constexpr bool selects(const Op *ops, int n, const Bits<W> (&in)[25], const Bits<W> &median, int out) {
        Bits<W> v[25] = {};
        for (int i = 0; i < 25; ++i)
            v[i] = in[i];
        for (int k = 0; k < n; ++k) {
            Bits<W> &a = v[ops[k].lo], &b = v[ops[k].hi];
            for (int j = 0; j < W; ++j) {
                const uint64_t lo = a.w[j] & b.w[j], hi = a.w[j] | b.w[j];
                a.w[j] = lo, b.w[j] = hi;
            }
        }
        for (int j = 0; j < W; ++j)
            if (v[out].w[j] != median.w[j]) return false;
        return true;
    }

    // The 0/1 tables whose column c holds 0s above row top[c] and 1s from
    // it down (tops non-increasing across the columns when `sortedRows`),
    // one bit each, and the bit set of their medians (at least 13 ones).
    template <int W> static constexpr int tables(bool sortedRows, Bits<W> (&in)[25], Bits<W> &median) {
        int count = 0;
        for (int code = 0; code < 7776; ++code) {
            int top[5] = {}, ones = 0;
            bool keep = true;
            for (int c = 0, rest = code; c < 5; ++c, rest /= 6) {
                top[c] = rest % 6;
                ones += 5 - top[c];
                if (sortedRows && c > 0 && top[c] > top[c - 1]) keep = false;
            }
            if (!keep) continue;
            for (int r = 0; r < 5; ++r)
                for (int c = 0; c < 5; ++c)
                    if (r >= top[c]) in[5 * r + c].w[count / 64] |= uint64_t{1} << (count % 64);
            if (ones >= 13) median.w[count / 64] |= uint64_t{1} << (count % 64);
            ++count;
        }
        return count;
    }

    constexpr Median25Network() {
        constexpr uint8_t kSort5[9][2] = {{0, 1}, {3, 4}, {2, 4}, {2, 3}, {0, 3}, {0, 2}, {1, 4}, {1, 3}, {1, 2}};
        // (rank, position in the sorted rank) of the undecided values.
        constexpr uint8_t kOpen[13][2] = {{0, 3}, {0, 4}, {1, 2}, {1, 3}, {1, 4}, {2, 1}, {2, 2},
                                          {2, 3}, {3, 0}, {3, 1}, {3, 2}, {4, 0}, {4, 1}};
        Op all[kMax] = {};
        int n = 0;
        for (int r = 0; r < 5; ++r)
            for (const auto &op : kSort5)
                all[n++] = {static_cast<uint8_t>(5 * r + op[0]), static_cast<uint8_t>(5 * r + op[1])};
        constexpr const auto &kMid = kSelect<13, 6>;
        auto wire = [&](int i) { return static_cast<uint8_t>(5 * kOpen[i][0] + kOpen[i][1]); };
        Op select[kMax] = {};
        int kept = 0;
        for (int i = 0; i < kMid.count; ++i)
            select[kept++] = {wire(kMid.ops[i].lo), wire(kMid.ops[i].hi)};
        out = wire(kMid.out);

        Bits<4> sorted[25] = {};
        Bits<4> sortedMedian = {};
        tables(true, sorted, sortedMedian);
        for (int i = 0; i < kept;) {
            Op without[kMax] = {};
            for (int k = 0, m = 0; k < kept; ++k)
                if (k != i) without[m++] = select[k];
            if (selects(without, kept - 1, sorted, sortedMedian, out)) {
                for (int k = 0; k < kept - 1; ++k)
                    select[k] = without[k];
                --kept;
            } else {
                ++i;
            }
        }
        for (int i = 0; i < kept; ++i)
            all[n++] = select[i];
        count = keep_reaching(all, n, out, ops);

        Bits<122> columns[25] = {};
        Bits<122> columnsMedian = {};
        tables(false, columns, columnsMedian);
        proven = selects(ops, count, columns, columnsMedian, out);
    }
};

inline constexpr Median25Network kMedian25{};
static_assert(kMedian25.proven);

// Samples per strip: the sorted columns of a strip stay on the stack, with
// room for the window's reach (2 columns of at most 4 channels each side) and
// for whole vectors past the end.
constexpr size_t kStrip = 2048;
constexpr size_t kColumn = kStrip + 4 * 4 + HWY_MAX_BYTES;

} // namespace

} // namespace pxfx

#endif // PXFX_MEDIAN_VECTOR_NETWORK

HWY_BEFORE_NAMESPACE();
namespace pxfx::HWY_NAMESPACE {
namespace {

namespace hn = hwy::HWY_NAMESPACE;
using D = hn::ScalableTag<uint8_t>;
using V = hn::Vec<D>;

HWY_INLINE void compare_exchange(V &a, V &b) {
    const V lo = hn::Min(a, b);
    b = hn::Max(a, b);
    a = lo;
}

template <size_t... I> HWY_INLINE void sort_rank_and_select(V (&v)[25], std::index_sequence<I...>) {
    (compare_exchange(v[kMedian25.ops[I].lo], v[kMedian25.ops[I].hi]), ...);
}

// Sorts the five rows' samples [from, from + count) column by column into
// cols[0..4] at `to`; count is at most one vector, the rest of the vector is
// written with what padding gives.
HWY_INLINE void sort_columns(const uint8_t *const *rows, ptrdiff_t from, size_t count, uint8_t (*cols)[kColumn],
                             size_t to) {
    const D d;
    const size_t lanes = hn::Lanes(d);
    V v[5];
    if (count == lanes) {
        for (int r = 0; r < 5; ++r)
            v[r] = hn::LoadU(d, rows[r] + from);
    } else {
        HWY_ALIGN uint8_t part[HWY_MAX_BYTES] = {};
        for (int r = 0; r < 5; ++r) {
            std::memcpy(part, rows[r] + from, count);
            v[r] = hn::Load(d, part);
        }
    }
    compare_exchange(v[0], v[1]);
    compare_exchange(v[3], v[4]);
    compare_exchange(v[2], v[4]);
    compare_exchange(v[2], v[3]);
    compare_exchange(v[0], v[3]);
    compare_exchange(v[0], v[2]);
    compare_exchange(v[1], v[4]);
    compare_exchange(v[1], v[3]);
    compare_exchange(v[1], v[2]);
    for (int r = 0; r < 5; ++r)
        hn::StoreU(v[r], d, cols[r] + to);
}

void median5_row(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out) {
    const D d;
    const size_t lanes = hn::Lanes(d);
    const auto C = static_cast<size_t>(channels);
    // cols[r][t]: rank r of the window column at sample s - 2C + t.
    HWY_ALIGN uint8_t cols[5][kColumn];
    HWY_ALIGN uint8_t last[HWY_MAX_BYTES];
    for (size_t s = 0; s < n; s += kStrip) {
        const size_t len = std::min(kStrip, n - s), span = len + 4 * C;
        const ptrdiff_t first = static_cast<ptrdiff_t>(s) - 2 * static_cast<ptrdiff_t>(C);
        for (size_t t = 0; t < span; t += lanes)
            sort_columns(rows, first + static_cast<ptrdiff_t>(t), std::min(lanes, span - t), cols, t);
        for (size_t j = 0; j < len; j += lanes) {
            V v[25];
            for (int r = 0; r < 5; ++r)
                for (size_t c = 0; c < 5; ++c)
                    v[5 * r + c] = hn::LoadU(d, cols[r] + j + c * C);
            sort_rank_and_select(v, std::make_index_sequence<kMedian25.count>{});
            const size_t m = std::min(lanes, len - j);
            if (m == lanes) {
                hn::StoreU(v[kMedian25.out], d, out + s + j);
            } else {
                hn::Store(v[kMedian25.out], d, last);
                std::memcpy(out + s + j, last, m);
            }
        }
    }
}

template <size_t... I> HWY_INLINE void select_cross(V (&v)[19], std::index_sequence<I...>) {
    (compare_exchange(v[kSelect<19, 9>.ops[I].lo], v[kSelect<19, 9>.ops[I].hi]), ...);
}

// The cross median: the 19 values of a centre go through the selection
// network, a vector of centres at a time; the last, partial vector is read
// and written through the stack.
void cross19_row(const uint8_t *const *rows, size_t n, uint8_t *out) {
    const D d;
    const size_t lanes = hn::Lanes(d);
    HWY_ALIGN uint8_t part[HWY_MAX_BYTES];
    for (size_t i = 0; i < n; i += lanes) {
        const size_t m = std::min(lanes, n - i);
        V v[19];
        auto load = [&](int wire, const uint8_t *p) {
            if (m == lanes) {
                v[wire] = hn::LoadU(d, p);
            } else {
                std::memset(part, 0, sizeof part);
                std::memcpy(part, p, m);
                v[wire] = hn::Load(d, part);
            }
        };
        for (int k = 0; k < 5; ++k)
            load(k, rows[k] + i);
        int wire = 5;
        for (ptrdiff_t off = -7; off <= 7; ++off)
            if (off != 0) load(wire++, rows[2] + static_cast<ptrdiff_t>(i) + off);
        select_cross(v, std::make_index_sequence<kSelect<19, 9>.count>{});
        if (m == lanes) {
            hn::StoreU(v[kSelect<19, 9>.out], d, out + i);
        } else {
            hn::Store(v[kSelect<19, 9>.out], d, part);
            std::memcpy(out + i, part, m);
        }
    }
}

} // namespace
} // namespace pxfx::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
#include "core/internal/simd.hpp"

namespace pxfx {
namespace {
HWY_EXPORT(median5_row);
HWY_EXPORT(cross19_row);
} // namespace

vec::Median5Row vec::median5_row() { return PXFX_VECTOR_COPY(median5_row); }
vec::Cross19Row vec::cross19_row() { return PXFX_VECTOR_COPY(cross19_row); }

} // namespace pxfx
#endif

#endif // PXFX_PORTABLE_ONLY
