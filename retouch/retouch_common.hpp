// Building blocks shared by the retouch tools: rank statistics of square
// windows over an 8-bit plane (reads outside the picture clamped to the
// nearest edge, as GetPixelIndex does) and brightening by a per-pixel amount
// map, for a source and a result of any formats.
//
// A window list sorted largest first (a stable selection sort) is fully
// determined by its value counts, so the ranks the retouch filters use - the
// k-th element of the sorted list and the position of the first element not
// above a value - come from a sliding grouped histogram of the window.
#pragma once

#include <algorithm>
#include <cstdint>
#include <cstring>

#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/rank.hpp"
#include "core/internal/view.hpp"

namespace pxfx {

// Copy of a w x h plane with `side - 1` extra rows and columns whose reads
// are clamped to the plane: padded (X, Y) holds plane (X + lo, Y + lo), so
// the window of offsets lo .. lo + side - 1 around (x, y) starts at padded
// (x, y). Null when it cannot be allocated.
inline Buffer<uint8_t> padded_plane(const uint8_t *plane, size_t stride, int32_t w, int32_t h, int32_t lo,
                                    int32_t side) {
    const int64_t pw = static_cast<int64_t>(w) + side - 1, ph = static_cast<int64_t>(h) + side - 1;
    Buffer<uint8_t> pad = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(pw), static_cast<uint64_t>(ph)));
    if (!pad) return pad;
    // Columns below `left` read the first column, those from `right` on the
    // last, those between their own column X + lo.
    const int64_t left = std::clamp<int64_t>(-int64_t{lo}, 0, pw);
    const int64_t right = std::clamp<int64_t>(int64_t{w} - lo, left, pw);
    for (int64_t Y = 0; Y < ph; ++Y) {
        const int64_t sy = Y + lo < 0 ? 0 : (Y + lo >= h ? h - 1 : Y + lo);
        const uint8_t *in = plane + static_cast<size_t>(sy) * stride;
        uint8_t *out = pad.get() + static_cast<size_t>(Y) * static_cast<size_t>(pw);
        std::memset(out, in[0], static_cast<size_t>(left));
        std::memcpy(out + left, in + left + lo, static_cast<size_t>(right - left));
        std::memset(out + right, in[w - 1], static_cast<size_t>(pw - right));
    }
    return pad;
}

// Calls fn(values) for each of the side x side offsets of the windows of row
// y of a padded plane (rows of `pw` bytes, from padded_plane): `values` holds
// the value at that offset of every pixel's window, one per pixel of the row.
template <class Fn> void for_each_window_offset(const uint8_t *pad, size_t pw, int32_t y, int32_t side, Fn &&fn) {
    for (int32_t dy = 0; dy < side; ++dy)
        for (int32_t dx = 0; dx < side; ++dx)
            fn(pad + static_cast<size_t>(y + dy) * pw + dx);
}

// Calls fn(x, y, centre, hist) for every pixel of a w x h plane (rows of
// `stride` bytes), rows from the top, with the histogram of the window of
// offsets lo..hi in both directions, reads clamped to the plane. Returns false
// when the padded working copy cannot be allocated.
template <class Fn>
bool for_each_window(const uint8_t *plane, size_t stride, int32_t w, int32_t h, int32_t lo, int32_t hi, Fn &&fn) {
    const int32_t side = hi - lo + 1;
    const size_t ps = static_cast<size_t>(w) + side - 1;
    Buffer<uint8_t> pad = padded_plane(plane, stride, w, h, lo, side);
    if (!pad) return false;
    rank::GroupedHistogram<256, uint32_t> hist;
    for (int32_t y = 0; y < h; ++y) {
        const uint8_t *top = pad.get() + static_cast<size_t>(y) * ps;
        const uint8_t *centreRow = plane + static_cast<size_t>(y) * stride;
        hist.reset();
        for (int32_t dy = 0; dy < side; ++dy)
            for (int32_t dx = 0; dx < side; ++dx)
                hist.add(top[static_cast<size_t>(dy) * ps + dx]);
        for (int32_t x = 0;; ++x) {
            fn(x, y, centreRow[x], hist);
            if (x + 1 >= w) break;
            const uint8_t *leaving = top + x, *entering = top + x + side;
            for (int32_t dy = 0; dy < side; ++dy) {
                hist.remove(leaving[static_cast<size_t>(dy) * ps]);
                hist.add(entering[static_cast<size_t>(dy) * ps]);
            }
        }
    }
    return true;
}

// c + weight * d in double precision, above 255.0 set to 255, else truncated.
inline uint32_t lift_channel(uint32_t c, uint32_t d, double weight) {
    const double v = static_cast<double>(c) + weight * static_cast<double>(d);
    return v > 255.0 ? 255u : static_cast<uint32_t>(v);
}

// Writes every pixel of src to dst, raising blue, green and red of the pixels
// whose amount byte d is non-zero by wb d, wg d and wr d; alpha kept.
template <class FS, class FD>
void lift_pixels(const View &src, const View &dst, const uint8_t *amount, size_t stride, double wb, double wg,
                 double wr) {
    const int32_t w = src.width, h = src.height;
    auto lift = [&](typename FS::CRow in, typename FD::Row out, int32_t x, uint32_t d) {
        const uint32_t c = FS::load(in, x);
        FD::store(out, x,
                  pack(lift_channel(blue_of(c), d, wb), lift_channel(green_of(c), d, wg),
                       lift_channel(red_of(c), d, wr), alpha_of(c)));
    };
    if constexpr (FS::kBitCount == FD::kBitCount && (FS::kBitCount == 24 || FS::kBitCount == 32)) {
        // Byte pixels of one format load and store unchanged: the rows are
        // copied whole and only the lifted pixels written again, found eight
        // amount bytes at a time. One block or two apart; blocks that
        // partly overlap take the pixel loop below.
        const bool same = src.bits == dst.bits && src.pitch == dst.pitch;
        if (same || blocks_apart(src, dst)) {
            const size_t rowBytes = static_cast<size_t>(w) * (FS::kBitCount / 8);
            for (int32_t y = 0; y < h; ++y) {
                const uint8_t *in = src.row(y);
                uint8_t *out = dst.row(y);
                if (!same) std::memcpy(out, in, rowBytes);
                const uint8_t *a = amount + static_cast<size_t>(y) * stride;
                for (int32_t x = 0; x < w;) {
                    uint64_t eight = 1;
                    if (x + 8 <= w) std::memcpy(&eight, a + x, 8);
                    if (eight == 0) {
                        x += 8;
                        continue;
                    }
                    if (a[x] != 0) lift(in, out, x, a[x]);
                    ++x;
                }
            }
            return;
        }
    }
    for (int32_t y = 0; y < h; ++y) {
        const typename FS::CRow in = FS::crow(src, y);
        const typename FD::Row out = FD::row(dst, y);
        const uint8_t *a = amount + static_cast<size_t>(y) * stride;
        for (int32_t x = 0; x < w; ++x) {
            if (a[x] != 0)
                lift(in, out, x, a[x]);
            else
                FD::store(out, x, FS::load(in, x));
        }
    }
}

} // namespace pxfx
