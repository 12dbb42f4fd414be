// Compare-exchange networks that select one element of a fixed number of
// values, shared by the plain and the vector medians.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pxfx {

// One compare-exchange: wire lo receives the smaller value, hi the larger.
struct CompareOp {
    uint8_t lo, hi;
};

// Copies the comparators of all[0 .. n) whose result can still reach wire
// `out` into `ops`, in order, and returns how many there are.
template <size_t M> constexpr int keep_reaching(const CompareOp (&all)[M], int n, int out, CompareOp (&ops)[M]) {
    bool needed[256] = {};
    bool keep[M] = {};
    needed[out] = true;
    for (int i = n - 1; i >= 0; --i)
        if (needed[all[i].lo] || needed[all[i].hi]) {
            keep[i] = true;
            needed[all[i].lo] = needed[all[i].hi] = true;
        }
    int count = 0;
    for (int i = 0; i < n; ++i)
        if (keep[i]) ops[count++] = all[i];
    return count;
}

// A compare-exchange network that leaves element K of N values at index
// `out`: Batcher's odd-even merge sort of the next power of two, with the
// missing inputs taken as +infinity (comparators against them vanish or only
// move a value) and the comparators that cannot reach `out` dropped.
template <int N, int K> struct SelectNetwork {
    using Op = CompareOp;
    static constexpr int kWires = N <= 32 ? 32 : 64;
    static constexpr int kInfinite = -1;
    Op ops[kWires * kWires] = {};
    int count = 0;
    int out = 0;

    constexpr SelectNetwork() {
        int slot[kWires] = {};
        for (int i = 0; i < kWires; ++i)
            slot[i] = i < N ? i : kInfinite;
        Op all[kWires * kWires] = {};
        int n = 0;
        for (int p = 1; p < kWires; p <<= 1)
            for (int k = p; k >= 1; k >>= 1)
                for (int j = k % p; j + k < kWires; j += 2 * k)
                    for (int i = 0; i < k && i + j + k < kWires; ++i) {
                        const int a = i + j, b = i + j + k;
                        if ((a / (2 * p)) != (b / (2 * p))) continue;
                        if (slot[b] == kInfinite) continue;
                        if (slot[a] == kInfinite) {
                            slot[a] = slot[b];
                            slot[b] = kInfinite;
                            continue;
                        }
                        all[n++] = {static_cast<uint8_t>(slot[a]), static_cast<uint8_t>(slot[b])};
                    }
        out = slot[K];
        count = keep_reaching(all, n, out, ops);
    }
};

template <int N, int K> inline constexpr SelectNetwork<N, K> kSelect{};

} // namespace pxfx
