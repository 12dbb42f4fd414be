// Sharpening with three fixed kernels, mean and median smoothing, and the
// partition-exchange sort px_ShellSort. The filters run in place: every row
// is read through a padded copy made before the row can be overwritten.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cstring>
#include <utility>

#include "core/internal/memory.hpp"
#include "core/internal/rank.hpp"
#include "core/internal/vector_kernels.hpp"
#include "toolkit/neighbourhood.hpp"
#include "toolkit/pximage_check.hpp"
#include "toolkit/select_network.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

const int32_t kSharpen3[9] = {0, -1, 0, -1, 5, -1, 0, -1, 0};
const int32_t kSharpen5[25] = {0, -1, -1, -1, 0, -1, 0, 1, 0, -1, -1, 1, 9, 1, -1, -1, 0, 1, 0, -1, 0, -1, -1, -1, 0};

// The 7 x 7 kernel's rows start at source row 49: result row r holds the
// filtered source row r + 49.
constexpr int32_t kSharpen7FirstRow = 49;

// Sharpening with the 3 x 3 or 5 x 5 kernel from row 0, or with the 7 x 7
// kernel (49 at the centre, -1 elsewhere, summed as 50 centre - window sum)
// from row 49; rows left without a result keep their content.
template <class F> bool sharpen(const View &v, int32_t size) {
    Window<F> win(v, size);
    const size_t n = win.samples();
    Buffer<int32_t> acc = alloc_buffer<int32_t>(n);
    Buffer<int32_t> cols = alloc_buffer<int32_t>(n + static_cast<size_t>(size - 1) * F::kChannels);
    if (!win.ok() || !acc || !cols) return false;
    const typename F::T *rows[7];
    const int32_t first = size == 7 ? kSharpen7FirstRow : 0;
    const vec::ConvolveBytes convolve = vec::convolve_bytes();
    const vec::WindowBoxBytes box = vec::window_box_bytes();
    for (int32_t y = first; y < v.height; ++y) {
        win.rows_for(y, rows);
        if (size == 7)
            box_store<F>(v, y - first, rows, 7, 50, box, cols.get(), acc.get());
        else
            convolve_store<F>(v, y, rows, size == 3 ? kSharpen3 : kSharpen5, size, 0, convolve, acc.get());
    }
    return true;
}

template <class F> bool mean_smooth(const View &v, int32_t size) {
    Window<F> win(v, size);
    const size_t n = win.samples();
    Buffer<int32_t> acc = alloc_buffer<int32_t>(n);
    Buffer<int32_t> cols = alloc_buffer<int32_t>(n + static_cast<size_t>(size - 1) * F::kChannels);
    if (!win.ok() || !acc || !cols) return false;
    const typename F::T *rows[7];
    const vec::WindowBoxBytes box = vec::window_box_bytes();
    for (int32_t y = 0; y < v.height; ++y) {
        win.rows_for(y, rows);
        box_store<F>(v, y, rows, size, 0, box, cols.get(), acc.get());
    }
    return true;
}

// Median of byte samples with a sliding histogram per row and channel and
// the tracked element k = size^2 / 2 of the sorted window.
template <class F> void median_row_bytes(const uint8_t *const *rows, int32_t size, size_t width, int32_t *acc) {
    constexpr int32_t C = F::kChannels;
    const int32_t half = size / 2, k = size * size / 2;
    for (int32_t c = 0; c < C; ++c) {
        rank::Histogram<256, int32_t> hist;
        hist.reset();
        for (int32_t ky = 0; ky < size; ++ky)
            for (int32_t kx = -half; kx <= half; ++kx)
                hist.add(rows[ky][static_cast<ptrdiff_t>(kx) * C + c]);
        rank::Cursor med{};
        for (size_t x = 0;; ++x) {
            acc[x * C + c] = med.settle(hist, k);
            if (x + 1 == width) break;
            const ptrdiff_t out = (static_cast<ptrdiff_t>(x) - half) * C + c;
            const ptrdiff_t in = (static_cast<ptrdiff_t>(x) + half + 1) * C + c;
            for (int32_t ky = 0; ky < size; ++ky) {
                const uint8_t a = rows[ky][out], b = rows[ky][in];
                hist.remove(a);
                med.removed(a);
                hist.add(b);
                med.added(b);
            }
        }
    }
}

// One compare-exchange of lanes a and b.
template <size_t Lanes> inline void compare_exchange(uint8_t (&a)[Lanes], uint8_t (&b)[Lanes]) {
    for (size_t j = 0; j < Lanes; ++j) {
        const uint8_t x = a[j], y = b[j];
        a[j] = x < y ? x : y;
        b[j] = x < y ? y : x;
    }
}

// The whole network unrolled, every lane index a constant.
template <const auto &Net, size_t Lanes, size_t N, size_t... I>
inline void apply_network(uint8_t (&v)[N][Lanes], std::index_sequence<I...>) {
    (compare_exchange(v[Net.ops[I].lo], v[Net.ops[I].hi]), ...);
}

// Median of byte samples through the selection network, kLanes samples at a
// time: value v of lane j is the window sample v (row-major) of sample i0 + j.
template <int Size, size_t kLanes>
inline void median_row_network(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out) {
    constexpr int N = Size * Size, half = Size / 2;
    constexpr const auto &kNet = kSelect<N, N / 2>;
    uint8_t v[N][kLanes];
    for (size_t i0 = 0; i0 < n; i0 += kLanes) {
        const size_t m = std::min(kLanes, n - i0);
        for (int ky = 0; ky < Size; ++ky)
            for (int kx = 0; kx < Size; ++kx) {
                const uint8_t *src =
                    rows[ky] + static_cast<ptrdiff_t>(i0) + static_cast<ptrdiff_t>(kx - half) * channels;
                uint8_t *lane = v[ky * Size + kx];
                for (size_t j = 0; j < m; ++j)
                    lane[j] = src[j];
                for (size_t j = m; j < kLanes; ++j)
                    lane[j] = 0;
            }
        apply_network<kSelect<N, N / 2>>(v, std::make_index_sequence<kSelect<N, N / 2>.count>{});
        for (size_t j = 0; j < m; ++j)
            out[i0 + j] = v[kNet.out][j];
    }
}

void median5_row(const uint8_t *const *rows, int32_t channels, size_t n, uint8_t *out) {
    median_row_network<5, 16>(rows, channels, n, out);
}

vec::Median5Row pick_median5() {
    const vec::Median5Row vector = vec::median5_row();
    return vector != nullptr ? vector : &median5_row;
}

// Median of 16-bit samples by selection of element size^2 / 2.
void median_row_words(const uint16_t *const *rows, int32_t size, size_t width, int32_t *acc) {
    const int32_t half = size / 2, k = size * size / 2;
    int32_t window[49];
    for (size_t x = 0; x < width; ++x) {
        int32_t m = 0;
        for (int32_t ky = 0; ky < size; ++ky)
            for (int32_t kx = -half; kx <= half; ++kx)
                window[m++] = rows[ky][static_cast<ptrdiff_t>(x) + kx];
        std::nth_element(window, window + k, window + m);
        acc[x] = window[k];
    }
}

template <class F> bool median_smooth(const View &v, int32_t size) {
    Window<F> win(v, size);
    const size_t n = win.samples();
    Buffer<int32_t> acc = alloc_buffer<int32_t>(n);
    if (!win.ok() || !acc) return false;
    const typename F::T *rows[7];
    const vec::Median5Row median5 = pick_median5();
    for (int32_t y = 0; y < v.height; ++y) {
        win.rows_for(y, rows);
        if constexpr (sizeof(typename F::T) == 1) {
            if (size == 5) {
                // Medians of bytes are bytes: they go straight into the row.
                median5(rows, F::kChannels, n, v.row(y));
                continue;
            }
            median_row_bytes<F>(rows, size, static_cast<size_t>(v.width), acc.get());
        } else
            median_row_words(rows, size, static_cast<size_t>(v.width), acc.get());
        store_row<F>(v, y, acc.get(), n, [](int32_t s) { return s; });
    }
    return true;
}

} // namespace

extern "C" {

int32_t PXImage_Sharpen(PXImage *img, int32_t strength) {
    if (!filter_input_ok(img) || strength == 0) return 0;
    if (strength > 100) return 1;
    const std::optional<View> v = view_of(img);
    if (!v) return filter_without_rows(img);
    const int32_t size = strength < 40 ? 3 : (strength < 80 ? 5 : 7);
    bool ok = true;
    if (!with_packed_format(img->bitcount, [&](auto f) { ok = sharpen<decltype(f)>(*v, size); })) return 1;
    return ok ? 1 : 0;
}

int32_t PXImage_Smooth(PXImage *img, int32_t strength) {
    if (!filter_input_ok(img) || strength == 0) return 0;
    const std::optional<View> v = view_of(img);
    if (!v) return filter_without_rows(img);
    const bool median = strength >= 60;
    const int32_t size = strength < 20 ? 3 : (strength < 40 ? 5 : (strength < 60 ? 7 : (strength < 80 ? 5 : 7)));
    bool ok = true;
    if (!with_packed_format(img->bitcount, [&](auto f) {
            using F = decltype(f);
            ok = median ? median_smooth<F>(*v, size) : mean_smooth<F>(*v, size);
        }))
        return 1;
    return ok ? 1 : 0;
}

void px_ShellSort(int32_t *values, int32_t first, int32_t last) {
    if (values == nullptr) return;
    // Hole-based partition around values[first]. The smaller side is sorted
    // by recursion and the larger one by the loop, which bounds the stack
    // depth by log2 of the length; the sorted result is the same whichever
    // side recurses.
    while (first < last) {
        const int32_t pivot = values[first];
        int32_t i = first, j = last;
        while (i < j) {
            while (i < j && values[j] >= pivot)
                --j;
            if (i < j) values[i++] = values[j];
            while (i < j && values[i] < pivot)
                ++i;
            if (i < j) values[j--] = values[i];
        }
        values[i] = pivot;
        if (i - first < last - i) {
            if (first < i - 1) px_ShellSort(values, first, i - 1);
            first = i + 1;
        } else {
            if (i + 1 < last) px_ShellSort(values, i + 1, last);
            last = i - 1;
        }
    }
}

} // extern "C"
