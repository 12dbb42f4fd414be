// Clamped square neighbourhoods of packed 8-, 16- and 24-bit images for the
// in-place filters: each source row is widened once into a padded copy so the
// filters run border-free over whole rows.
#pragma once

#include <pxfx/toolkit.h>

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/vector_kernels.hpp"
#include "toolkit/pximage_check.hpp"

namespace pxfx::packed {

// True for records the in-place filters take: data, and rows that stay
// inside the block (or none).
inline bool filter_input_ok(const PXImage *img) {
    return img != nullptr && img->data != nullptr && px_rows_inside(img);
}

// What the in-place filters give for an image without pixel rows (a width or
// height of 0 or below). Bit counts other than 8, 16 and 24 return 1 before
// any memory is needed. For those three the scratch image of width x height
// pixels gets no block for a count of 0 or below (0); with both sizes
// negative it does, no pixel is visited, and copying the unwritten scratch
// back is left out (1, image unchanged).
inline int32_t filter_without_rows(const PXImage *img) {
    const int32_t bits = img->bitcount;
    if (bits != 8 && bits != 16 && bits != 24) return 1;
    return buffer_size_ok(block_size(img->width, img->height, px_bytes(bits))) ? 1 : 0;
}

// Neighbourhood rows of `size` x `size` windows. Padded row r holds the
// samples at columns -half .. width - 1 + half, sample (p, c) at index
// (p + half) * C + c, read as the filters define their clamp: rows and
// columns are held to the picture, except that 24-bit pictures hold the byte
// index 3p to 0 .. 3 width - 1 and read three bytes from there, so right of
// the picture they read the last byte of the row and the first two of the
// next one. Bytes past the end of the block read as 0.
template <class F> class Window {
  public:
    using T = typename F::T;
    static constexpr int32_t C = F::kChannels;

    Window(const View &v, int32_t size)
        : v_(v), size_(size), half_(size / 2),
          padded_((static_cast<size_t>(v.width) + 2 * static_cast<size_t>(half_)) * C),
          ring_(alloc_buffer<T>(checked_size(padded_, static_cast<uint64_t>(size)))) {}

    bool ok() const { return static_cast<bool>(ring_); }
    // Samples per output row (width x channels).
    size_t samples() const { return static_cast<size_t>(v_.width) * C; }

    // Fills rows[0 .. size - 1] with the padded rows y - half .. y + half
    // (clamped). Rows must be asked for in increasing order of y; the source
    // rows from y + half on must still hold their original content.
    void rows_for(int32_t y, const T **rows) {
        const int32_t h = v_.height;
        const int32_t need = y + half_ < h ? y + half_ : h - 1;
        while (built_ < need)
            build(++built_);
        for (int32_t k = 0; k < size_; ++k) {
            int32_t r = y - half_ + k;
            r = r < 0 ? 0 : (r >= h ? h - 1 : r);
            rows[k] = slot(r) + static_cast<size_t>(half_) * C;
        }
    }

  private:
    T *slot(int32_t r) { return ring_.get() + static_cast<size_t>(r % size_) * padded_; }

    // Pixels 0 .. own - 1 of padded row r are a plain copy of the row; the
    // others go through `clamped`, which gives pixel p's samples.
    template <class Clamped> void fill(T *out, const uint8_t *row, int32_t own, Clamped clamped) {
        std::memcpy(out + static_cast<size_t>(half_) * C, row, static_cast<size_t>(own) * C * sizeof(T));
        for (int32_t p = -half_; p < 0; ++p)
            clamped(p);
        for (int32_t p = own; p < v_.width + half_; ++p)
            clamped(p);
    }

    void build(int32_t r) {
        T *out = slot(r);
        const int32_t w = v_.width;
        if constexpr (C == 3) {
            const uint8_t *block = v_.bits;
            const size_t rowStart = static_cast<size_t>(r) * v_.pitch, end = v_.block_bytes();
            const int64_t last = int64_t{w} * 3 - 1;
            const int32_t own = rowStart + static_cast<size_t>(w) * 3 <= end ? w : 0;
            fill(out, block + rowStart, own, [&](int32_t p) {
                int64_t idx = int64_t{p} * 3;
                idx = idx < 0 ? 0 : (idx > last ? last : idx);
                for (int32_t c = 0; c < 3; ++c) {
                    const size_t k = rowStart + static_cast<size_t>(idx) + c;
                    out[static_cast<size_t>(p + half_) * 3 + c] = k < end ? block[k] : 0;
                }
            });
        } else {
            const uint8_t *row = v_.row(r);
            // 16-bit samples are widened one by one.
            const int32_t own = sizeof(T) == 1 ? w : 0;
            fill(out, row, own, [&](int32_t p) {
                const int32_t x = p < 0 ? 0 : (p >= w ? w - 1 : p);
                if constexpr (sizeof(T) == 1)
                    out[p + half_] = row[x];
                else
                    out[p + half_] = static_cast<T>(load16(row + 2 * static_cast<size_t>(x)));
            });
        }
    }

    View v_;
    int32_t size_, half_;
    size_t padded_;
    Buffer<T> ring_;
    int32_t built_ = -1;
};

// Writes a row of sums into row y of the view, each passed through `fix` and
// clamped to the format's range.
template <class F, class Fix> void store_row(const View &v, int32_t y, const int32_t *acc, size_t n, Fix fix) {
    uint8_t *out = v.row(y);
    if constexpr (sizeof(typename F::T) == 1) {
        for (size_t i = 0; i < n; ++i) {
            const int32_t x = fix(acc[i]);
            out[i] = static_cast<uint8_t>(x < 0 ? 0 : (x > F::kMax ? F::kMax : x));
        }
    } else {
        for (size_t i = 0; i < n; ++i) {
            const int32_t x = fix(acc[i]);
            store16(out + 2 * i, static_cast<uint32_t>(x < 0 ? 0 : (x > F::kMax ? F::kMax : x)));
        }
    }
}

// acc[i] = sum of kernel[ky * size + kx] * rows[ky][i + (kx - half) * C]
// for the non-zero entries.
template <class T>
void convolve_row(const T *const *rows, const int32_t *kernel, int32_t size, int32_t channels, size_t n, int32_t *acc) {
    const int32_t half = size / 2;
    for (size_t i = 0; i < n; ++i)
        acc[i] = 0;
    for (int32_t ky = 0; ky < size; ++ky)
        for (int32_t kx = 0; kx < size; ++kx) {
            const int32_t k = kernel[ky * size + kx];
            if (k == 0) continue;
            const T *src = rows[ky] + static_cast<ptrdiff_t>(kx - half) * channels;
            for (size_t i = 0; i < n; ++i)
                acc[i] += k * static_cast<int32_t>(src[i]);
        }
}

// Row y of the view from its window rows convolved with `kernel` (size x size
// weights whose magnitudes sum to at most 128), each sum shifted right by
// `shift` and clamped to the format's range. Byte samples go through
// `vector` (vec::convolve_bytes(), picked once per call) where it takes the
// row; `acc` has room for a row of sums.
template <class F>
void convolve_store(const View &v, int32_t y, const typename F::T *const *rows, const int32_t *kernel, int32_t size,
                    int32_t shift, vec::ConvolveBytes vector, int32_t *acc) {
    const size_t n = static_cast<size_t>(v.width) * F::kChannels;
    if constexpr (sizeof(typename F::T) == 1)
        if (vector != nullptr && vector(rows, kernel, size, F::kChannels, n, shift, v.row(y))) return;
    convolve_row(rows, kernel, size, F::kChannels, n, acc);
    store_row<F>(v, y, acc, n, [shift](int32_t s) { return s >> shift; });
}

// acc[i] = sum of the size x size window around sample i; `cols` holds
// n + (size - 1) * channels column sums.
template <class T>
void box_row(const T *const *rows, int32_t size, int32_t channels, size_t n, int32_t *cols, int32_t *acc) {
    const int32_t half = size / 2;
    const size_t span = n + static_cast<size_t>(size - 1) * channels;
    const ptrdiff_t lead = static_cast<ptrdiff_t>(half) * channels;
    for (size_t i = 0; i < span; ++i)
        cols[i] = 0;
    for (int32_t ky = 0; ky < size; ++ky) {
        const T *src = rows[ky] - lead;
        for (size_t i = 0; i < span; ++i)
            cols[i] += src[i];
    }
    for (size_t i = 0; i < n; ++i)
        acc[i] = 0;
    for (int32_t kx = 0; kx < size; ++kx) {
        const int32_t *c = cols + static_cast<size_t>(kx) * channels;
        for (size_t i = 0; i < n; ++i)
            acc[i] += c[i];
    }
}

// Row `row` of the view from the box sums of the window rows (size 3, 5 or
// 7): with `centre` 0 their means (sum / size^2, truncated), else centre
// times the window's centre sample minus the sum, clamped to the format's
// range. Byte samples go through `vector` (vec::window_box_bytes(), picked
// once per call) where it takes the row; `cols` and `acc` are box_row's.
template <class F>
void box_store(const View &v, int32_t row, const typename F::T *const *rows, int32_t size, int32_t centre,
               vec::WindowBoxBytes vector, int32_t *cols, int32_t *acc) {
    const size_t n = static_cast<size_t>(v.width) * F::kChannels;
    if constexpr (sizeof(typename F::T) == 1)
        if (vector != nullptr && vector(rows, size, F::kChannels, n, centre, v.row(row))) return;
    box_row(rows, size, F::kChannels, n, cols, acc);
    if (centre == 0) {
        const auto area = static_cast<uint32_t>(size * size);
        store_row<F>(v, row, acc, n,
                     [area](int32_t s) { return static_cast<int32_t>(static_cast<uint32_t>(s) / area); });
        return;
    }
    const typename F::T *mid = rows[size / 2];
    for (size_t i = 0; i < n; ++i)
        acc[i] = centre * static_cast<int32_t>(mid[i]) - acc[i];
    store_row<F>(v, row, acc, n, [](int32_t s) { return s; });
}

} // namespace pxfx::packed
