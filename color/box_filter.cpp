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

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"

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

// Writes the row means of the column sums `col` (bpp channels interleaved).
template <class Sum, int Bpp>
void row_means(const Sum *col, int32_t w, const Box &box, const Mean<Sum> &mean, uint8_t *out) {
    Sum s[Bpp];
    for (int k = 0; k < Bpp; ++k) {
        s[k] = clamped_sum<Sum>(box.first(0), box.last(0), w, [&](int32_t c) { return col[Bpp * c + k]; });
        out[k] = mean(s[k]);
    }
    for (int32_t x = 1; x < w; ++x) {
        const Sum *in = col + Bpp * clamp_coord(box.last(x), w);
        const Sum *gone = col + Bpp * clamp_coord(box.first(x) - 1, w);
        for (int k = 0; k < Bpp; ++k) {
            s[k] += in[k] - gone[k];
            out[Bpp * x + k] = mean(s[k]);
        }
    }
}

template <class Sum, int Bpp>
void running_box(const Image *src, Image *dst, const Box &box, const Mean<Sum> &mean, Sum *col) {
    const int32_t w = src->width, h = src->height;
    const size_t n = static_cast<size_t>(w) * Bpp;
    for (size_t j = 0; j < n; ++j) {
        col[j] = clamped_sum<Sum>(box.first(0), box.last(0), h,
                                  [&](int32_t r) { return static_cast<Sum>(row_ptr(src, r)[j]); });
    }
    row_means<Sum, Bpp>(col, w, box, mean, row_ptr(dst, 0));
    for (int32_t y = 1; y < h; ++y) {
        const uint8_t *in = row_ptr(src, clamp_coord(box.last(y), h));
        const uint8_t *gone = row_ptr(src, clamp_coord(box.first(y) - 1, h));
        for (size_t j = 0; j < n; ++j)
            col[j] += static_cast<Sum>(in[j]) - static_cast<Sum>(gone[j]);
        row_means<Sum, Bpp>(col, w, box, mean, row_ptr(dst, y));
    }
}

// Every box summed in full, for when the column sums cannot be had.
template <class Sum, int Bpp> void full_box(const Image *src, Image *dst, const Box &box, const Mean<Sum> &mean) {
    const int32_t w = src->width, h = src->height;
    for (int32_t y = 0; y < h; ++y) {
        uint8_t *out = row_ptr(dst, y);
        for (int32_t x = 0; x < w; ++x)
            for (int k = 0; k < Bpp; ++k) {
                const Sum s = clamped_sum<Sum>(box.first(y), box.last(y), h, [&](int32_t r) {
                    const uint8_t *row = row_ptr(src, r);
                    return clamped_sum<Sum>(box.first(x), box.last(x), w,
                                            [&](int32_t c) { return static_cast<Sum>(row[Bpp * c + k]); });
                });
                out[Bpp * x + k] = mean(s);
            }
    }
}

template <class Sum, int Bpp> void smooth(const Image *src, Image *dst, int32_t size, int32_t offset, bool running) {
    const Box box{size, size / 2};
    const Mean<Sum> mean(size, offset);
    Buffer<Sum> col = running ? alloc_zeroed<Sum>(checked_size(static_cast<uint64_t>(src->width), Bpp)) : Buffer<Sum>();
    if (col)
        running_box<Sum, Bpp>(src, dst, box, mean, col.get());
    else
        full_box<Sum, Bpp>(src, dst, box, mean);
}

// Sums fit 32 bits while 255 * size^2 does.
constexpr int32_t kMaxSize32 = 2901;

template <int Bpp> void smooth_any(const Image *src, Image *dst, int32_t size, int32_t offset, bool running) {
    if (size <= kMaxSize32)
        smooth<int32_t, Bpp>(src, dst, size, offset, running);
    else
        smooth<int64_t, Bpp>(src, dst, size, offset, running);
}

} // namespace

namespace pxfx {

int32_t box_filter(Image *image, int32_t size, int32_t offset, bool runningSums) {
    if (!has_pixels(image) || image->bitCount < 8 || size <= 0 || size > kMaxBoxSize) return 0;
    ImagePtr work = make_image(image->width, image->height, static_cast<int32_t>(image->bitCount));
    if (!work) return 0;
    switch (image->bitCount) {
    case 8: smooth_any<1>(image, work.get(), size, offset, runningSums); break;
    case 24: smooth_any<3>(image, work.get(), size, offset, runningSums); break;
    case 32: smooth_any<4>(image, work.get(), size, offset, runningSums); break;
    default: break; // the working image stays white
    }
    PX_Img_Copy(image, work.get());
    return 1;
}

} // namespace pxfx

extern "C" {

int32_t Filter_fast(Image *image, int32_t size, int32_t offset) { return box_filter(image, size, offset, true); }

int32_t PX_IMG_Smooth(const Image *src, Image **out, int32_t strength) {
    if (!has_pixels(src)) return 0;
    Image *target = const_cast<Image *>(src);
    bool made = false;
    if (out != nullptr) {
        if (*out == nullptr) {
            *out = malloc_Image(src->width, src->height, static_cast<int32_t>(src->bitCount));
            if (*out == nullptr) return 0;
            made = true;
        } else if (!has_pixels(*out)) {
            return 0;
        }
        target = *out;
        PX_Img_Copy(target, src);
    }
    const int32_t size = strength <= 3 ? 0 : std::min(strength, 100) / 10;
    // Sizes of 0 and pictures below 8 bits are left as they are; any other
    // refusal of the box filter is its working image failing.
    if (size == 0 || target->bitCount < 8 || Filter_fast(target, size, 0) == 1) return 1;
    if (made) free_Image(out, 0);
    return 0;
}

} // extern "C"
