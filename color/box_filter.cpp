// Box smoothing: Filter_fast and the PX_IMG_Smooth effect.
//
// The box of pixel (x, y) covers columns x - size/2 .. x + size - size/2 - 1
// and the same rows, edges repeated. It is summed separably: one running sum
// per column and channel (the column's box rows) updated by one entering and
// one leaving row per output row, then a running sum along the row over those
// column sums. Integer sums make this exactly the full box sum, at a cost per
// pixel that does not depend on the size.
#include "color/box_filter.hpp"

#include <pxfx/color.h>

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/vector_kernels.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// Sum of v(clamp(i, 0, n - 1)) for i in [a, b]: the indices off either end
// count the edge value once each, so the work is bounded by n.
template <class Sum, class At> Sum clamped_sum(int64_t a, int64_t b, int32_t n, At at) {
    const int64_t below = std::max<int64_t>(0, std::min<int64_t>(b, -1) - a + 1);
    const int64_t above = std::max<int64_t>(0, b - std::max<int64_t>(a, n) + 1);
    Sum s = static_cast<Sum>(below) * at(0) + static_cast<Sum>(above) * at(n - 1);
    for (int64_t i = std::max<int64_t>(a, 0), e = std::min<int64_t>(b, n - 1); i <= e; ++i)
        s += at(static_cast<int32_t>(i));
    return s;
}

// mean = sum / size^2 (truncating) + offset, clamped; through a table of every
// possible sum when that table is small.
template <class Sum> struct Mean {
    int64_t area, offset;
    Buffer<uint8_t> table;
    Mean(int32_t size, int32_t off) : area(static_cast<int64_t>(size) * size), offset(off) {
        if (255 * area >= (1 << 18)) return;
        table = alloc_buffer<uint8_t>(static_cast<size_t>(255 * area + 1));
        if (!table) return;
        for (int64_t s = 0; s <= 255 * area; ++s)
            table[static_cast<size_t>(s)] = slow(static_cast<Sum>(s));
    }
    uint8_t slow(Sum s) const { return static_cast<uint8_t>(std::clamp<int64_t>(s / area + offset, 0, 255)); }
    uint8_t operator()(Sum s) const { return table ? table[static_cast<size_t>(s)] : slow(s); }
};

struct Box {
    int32_t size, half;
    int64_t first(int64_t x) const { return x - half; }           // first index of the box at x
    int64_t last(int64_t x) const { return x + size - half - 1; } // last index
};

// Writes the row means of the column sums `col` (bpp channels interleaved);
// diff has room for a row of sums.
template <class Sum, int Bpp, class MeanFn>
void row_means(const Sum *col, Sum *diff, int32_t w, const Box &box, const MeanFn &meanFn, uint8_t *out) {
    const MeanFn mean = meanFn; // a local copy: the result stores cannot alias what it holds
    Sum s[Bpp];
    for (int k = 0; k < Bpp; ++k) {
        s[k] = clamped_sum<Sum>(box.first(0), box.last(0), w, [&](int32_t c) { return col[Bpp * c + k]; });
        out[k] = mean(s[k]);
    }
    // Columns x whose entering and leaving columns both lie inside the row
    // need no clamping: x in [half + 1, w - size + half].
    const int64_t lo = std::clamp<int64_t>(box.half + 1, 1, w);
    const int64_t hi = std::clamp<int64_t>(static_cast<int64_t>(w) - box.size + box.half + 1, lo, w);
    auto step = [&](int32_t x, const Sum *in, const Sum *gone) {
        for (int k = 0; k < Bpp; ++k) {
            s[k] += in[k] - gone[k];
            out[Bpp * x + k] = mean(s[k]);
        }
    };
    auto clamped = [&](int32_t x) {
        step(x, col + Bpp * clamp_coord(box.last(x), w), col + Bpp * clamp_coord(box.first(x) - 1, w));
    };
    for (int32_t x = 1; x < lo; ++x)
        clamped(x);
    // The entering minus the leaving column of every interior step first, in
    // one vector loop, so that the running sums only add one value each.
    const Sum *in = col + Bpp * (lo + box.size - box.half - 1), *gone = col + Bpp * (lo - box.half - 1);
    const size_t steps = static_cast<size_t>(hi - lo) * Bpp;
    for (size_t j = 0; j < steps; ++j)
        diff[j] = in[j] - gone[j];
    const Sum *d = diff;
    for (int32_t x = static_cast<int32_t>(lo); x < hi; ++x, d += Bpp)
        for (int k = 0; k < Bpp; ++k) {
            s[k] += d[k];
            out[Bpp * x + k] = mean(s[k]);
        }
    for (int32_t x = static_cast<int32_t>(hi); x < w; ++x)
        clamped(x);
}

// Column sums run down the picture, one result row at a time. When the result
// replaces the source (dst == src), every source row is saved in `ring`
// (ringRows rows, at least half + 2 or the whole height) before it is
// overwritten, and the rows leaving the box are read back from there.
// `sums` holds the column sums: sums.set(j, s) starts sum j (of width x
// channels) at the top row's box, sums.row(in, gone, out) adds the entering
// row, subtracts the leaving one (both null for row 0) and writes the means.
template <class Sum, class Sums>
void running_box(const View &src, const View &dst, const Box &box, size_t n, Sums &sums, uint8_t *ring,
                 int32_t ringRows) {
    const int32_t h = src.height;
    for (size_t j = 0; j < n; ++j)
        sums.set(j, clamped_sum<Sum>(box.first(0), box.last(0), h,
                                     [&](int32_t r) { return static_cast<Sum>(src.row(r)[j]); }));
    for (int32_t y = 0; y < h; ++y) {
        if (ring != nullptr) std::memcpy(ring + static_cast<size_t>(y % ringRows) * n, src.row(y), n);
        const uint8_t *in = nullptr, *gone = nullptr;
        if (y > 0) {
            // The entering row is at or below y, so it still holds source pixels.
            in = src.row(clamp_coord(box.last(y), h));
            const int32_t r = clamp_coord(box.first(y) - 1, h);
            gone = ring != nullptr ? ring + static_cast<size_t>(r % ringRows) * n : src.row(r);
        }
        sums.row(in, gone, dst.row(y));
    }
}

// Column sums of Sum with the row means of row_means.
template <class Sum, int Bpp, class MeanFn> struct PlainSums {
    Sum *col; // n sums, then room for a row of their differences
    size_t n;
    int32_t width;
    Box box;
    MeanFn mean;
    void set(size_t j, Sum s) { col[j] = s; }
    void row(const uint8_t *in, const uint8_t *gone, uint8_t *out) {
        if (in != nullptr)
            for (size_t j = 0; j < n; ++j)
                col[j] += static_cast<Sum>(in[j]) - static_cast<Sum>(gone[j]);
        row_means<Sum, Bpp>(col, col + n, width, box, mean, out);
    }
};

// 16-bit column sums padded with the edge pixels' for vec::BoxBytes.
struct VectorSums {
    vec::BoxBytes kernel;
    uint16_t *cols;
    size_t n;
    Box box;
    int32_t channels, offset;
    void set(size_t j, int32_t s) { cols[static_cast<size_t>(box.half * channels) + j] = static_cast<uint16_t>(s); }
    void row(const uint8_t *in, const uint8_t *gone, uint8_t *out) {
        kernel(in, gone, cols, n, box.size, channels, offset, out);
    }
};

// Every box summed in full, for when the column sums cannot be had.
template <class Sum, int Bpp> void full_box(const View &src, const View &dst, const Box &box, const Mean<Sum> &mean) {
    const int32_t w = src.width, h = src.height;
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *out = dst.row(y);
        for (int32_t x = 0; x < w; ++x)
            for (int k = 0; k < Bpp; ++k) {
                const Sum s = clamped_sum<Sum>(box.first(y), box.last(y), h, [&](int32_t r) {
                    const uint8_t *row = src.row(r);
                    return clamped_sum<Sum>(box.first(x), box.last(x), w,
                                            [&](int32_t c) { return static_cast<Sum>(row[Bpp * c + k]); });
                });
                out[Bpp * x + k] = mean(s);
            }
    }
}

// Smooths src into dst; with a ring (see running_box) dst is src itself.
template <class Sum, int Bpp>
bool smooth(const View &src, const View &dst, int32_t size, int32_t offset, bool running, uint8_t *ring,
            int32_t ringRows) {
    const Box box{size, size / 2};
    const size_t n = static_cast<size_t>(src.width) * Bpp;
    if (running && size >= vec::kMinBoxBytes && size <= vec::kMaxBoxBytes) {
        // Sums of at most 255 x 11^2 fit 16 bits.
        if (const vec::BoxBytes kernel = vec::box_bytes()) {
            Buffer<uint16_t> cols =
                alloc_buffer<uint16_t>(checked_size(static_cast<uint64_t>(src.width) + size - 1, Bpp));
            if (cols) {
                VectorSums sums{kernel, cols.get(), n, box, Bpp, offset};
                running_box<int32_t>(src, dst, box, n, sums, ring, ringRows);
                return true;
            }
        }
    }
    const Mean<Sum> mean(size, offset);
    // Column sums and a row of their differences.
    Buffer<Sum> col =
        running ? alloc_zeroed<Sum>(checked_size(static_cast<uint64_t>(src.width), 2 * Bpp)) : Buffer<Sum>();
    if (col && mean.table) {
        // The table through a local pointer: stores to the result rows cannot
        // alias it, so the loop keeps it in a register.
        const uint8_t *table = mean.table.get();
        auto lookup = [table](Sum v) { return table[static_cast<size_t>(v)]; };
        PlainSums<Sum, Bpp, decltype(lookup)> sums{col.get(), n, src.width, box, lookup};
        running_box<Sum>(src, dst, box, n, sums, ring, ringRows);
    } else if (col) {
        auto slow = [&mean](Sum v) { return mean.slow(v); };
        PlainSums<Sum, Bpp, decltype(slow)> sums{col.get(), n, src.width, box, slow};
        running_box<Sum>(src, dst, box, n, sums, ring, ringRows);
    } else if (ring == nullptr) {
        full_box<Sum, Bpp>(src, dst, box, mean);
    } else {
        return false;
    }
    return true;
}

// Sums fit 32 bits while 255 * size^2 does.
constexpr int32_t kMaxSize32 = 2901;

template <int Bpp>
bool smooth_any(const View &src, const View &dst, int32_t size, int32_t offset, bool running, uint8_t *ring = nullptr,
                int32_t ringRows = 0) {
    if (size <= kMaxSize32) return smooth<int32_t, Bpp>(src, dst, size, offset, running, ring, ringRows);
    return smooth<int64_t, Bpp>(src, dst, size, offset, running, ring, ringRows);
}

// Running sums straight into the image, keeping only the source rows that
// are still to leave the box; false (image untouched) when the working
// memory cannot be had.
bool smooth_in_place(const View &image, int32_t size, int32_t offset) {
    const int32_t ringRows = static_cast<int32_t>(std::min<int64_t>(size / 2 + 2, image.height));
    const uint32_t bpp = image.bitCount / 8;
    Buffer<uint8_t> ring =
        alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(image.width), bpp, static_cast<uint64_t>(ringRows)));
    if (!ring) return false;
    switch (image.bitCount) {
    case 8: return smooth_any<1>(image, image, size, offset, true, ring.get(), ringRows);
    case 24: return smooth_any<3>(image, image, size, offset, true, ring.get(), ringRows);
    default: return smooth_any<4>(image, image, size, offset, true, ring.get(), ringRows);
    }
}

} // namespace

namespace pxfx {

int32_t box_filter(Image *image, int32_t size, int32_t offset, bool runningSums) {
    const std::optional<View> v = view_of(image);
    if (!v || v->bitCount < 8 || size == 0 || size < -kMaxBoxSize || size > kMaxBoxSize) return 0;
    // The result is made in a new white image and copied back with
    // PX_Img_Copy: the whole block, padding bytes (255) included, when the
    // image has the new image's pitch; otherwise pixel by pixel, a 32-bit
    // image keeping its own alpha. Smoothing in place gives the same only in
    // the first case.
    const bool direct = v->bitCount == 8 || v->bitCount == 24 || v->bitCount == 32;
    const bool wholeBlock = direct && v->pitch == fresh_pitch(v->width, v->bitCount);
    if (size > 0 && runningSums && wholeBlock && smooth_in_place(*v, size, offset)) {
        const size_t used = static_cast<size_t>(v->width) * (v->bitCount / 8);
        for (int32_t y = 0; y < v->height; ++y)
            std::memset(v->row(y) + used, 255, v->pitch - used);
        return 1;
    }
    ImagePtr work = make_image(v->width, v->height, static_cast<int32_t>(v->bitCount));
    if (!work) return 0;
    const View w = *view_of(work.get());
    if (size < 0 && direct) {
        // A negative size makes every box empty: each channel is its sum 0
        // divided by size^2, plus the offset, clamped.
        const uint8_t flat = static_cast<uint8_t>(std::clamp(offset, 0, 255));
        for (int32_t y = 0; y < w.height; ++y)
            std::memset(w.row(y), flat, static_cast<size_t>(w.width) * (w.bitCount / 8));
    } else if (size > 0) {
        switch (v->bitCount) {
        case 8: smooth_any<1>(*v, w, size, offset, runningSums); break;
        case 24: smooth_any<3>(*v, w, size, offset, runningSums); break;
        case 32: smooth_any<4>(*v, w, size, offset, runningSums); break;
        default: break; // the working image stays white
        }
    }
    PX_Img_Copy(image, work.get());
    return 1;
}

} // namespace pxfx

extern "C" {

int32_t Filter_fast(Image *image, int32_t size, int32_t offset) { return box_filter(image, size, offset, true); }

int32_t PX_IMG_Smooth(const Image *src, Image **out, int32_t strength) {
    if (src == nullptr || src->bits == nullptr || !rows_inside(src)) return 0;
    // With no slot the source itself is smoothed.
    InPlaceOrSlot rule(const_cast<Image *>(src), out);
    Image *target = rule.work_target();
    if (target == nullptr) return 0;
    const int32_t size = strength <= 3 ? 0 : std::min(strength, 100) / 10;
    // What the box filter refuses (a size of 0, a target without pixels or
    // below 8 bits) is left as it is; a picture it takes fails only when its
    // working image cannot be made.
    if (size == 0) return 1;
    if (const std::optional<View> t = view_of(target); !t || t->bitCount < 8 || Filter_fast(target, size, 0) == 1)
        return 1;
    rule.discard_new();
    return 0;
}

} // extern "C"
