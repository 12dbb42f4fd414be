// The 3 x 3 edge filter and Otsu binarisation of packed images.
#include <pxfx/toolkit.h>

#include "core/internal/memory.hpp"
#include "toolkit/neighbourhood.hpp"
#include "toolkit/otsu.hpp"
#include "toolkit/pximage_check.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace {

// Deliberately lopsided: the bottom-middle entry is 1.
const int32_t kEdge[9] = {1, 0, -1, 2, 0, -2, 1, 1, -1};

template <class F> bool edge_filter(const View &v) {
    Window<F> win(v, 3);
    const size_t n = win.samples();
    Buffer<int32_t> acc = alloc_buffer<int32_t>(n);
    if (!win.ok() || !acc) return false;
    const typename F::T *rows[3];
    const vec::ConvolveBytes vector = vec::convolve_bytes();
    for (int32_t y = 0; y < v.height; ++y) {
        win.rows_for(y, rows);
        convolve_store<F>(v, y, rows, kEdge, 3, 2, vector, acc.get());
    }
    return true;
}

// The 6-bit middle field of a 16-bit sample, scaled to 0..252.
constexpr uint32_t word_gray(uint32_t s) { return (s & 0x7E0) >> 3; }

} // namespace

extern "C" {

int32_t PXImage_EdgeDetection(PXImage *img) {
    if (!filter_input_ok(img)) return 0;
    const std::optional<View> v = view_of(img);
    if (!v) return filter_without_rows(img);
    bool ok = true;
    if (!with_packed_format(img->bitcount, [&](auto f) { ok = edge_filter<decltype(f)>(*v); })) return 1;
    return ok ? 1 : 0;
}

int32_t PXImage_GrayToBinarization(PXImage *img) {
    if (!filter_input_ok(img)) return 0;
    const int32_t bits = img->bitcount;
    if (bits != 8 && bits != 16 && bits != 24) return 0;
    // Without pixel rows: 0 when width x height bytes make no block (a count
    // of 0 or below); with both sizes negative they do, and no sample is read
    // or mapped (1).
    const std::optional<View> v = view_of(img);
    if (!v) return buffer_size_ok(block_size(img->width, img->height, 1)) ? 1 : 0;
    const size_t pixels = static_cast<size_t>(v->width) * static_cast<size_t>(v->height);
    uint8_t *d = v->bits;
    // The threshold of the grey plane, counted straight from the pixels: the
    // byte of 8-bit pixels, the green byte of 24-bit ones, the scaled middle
    // field of 16-bit ones.
    uint32_t hist[256];
    if (bits == 8) {
        count_levels(pixels, hist, [d](size_t i) { return d[i]; });
        const auto t = static_cast<uint8_t>(otsu_threshold(hist));
        for (size_t i = 0; i < pixels; ++i)
            d[i] = d[i] > t ? 255 : 0;
    } else if (bits == 24) {
        count_levels(pixels, hist, [d](size_t i) { return d[3 * i + 1]; });
        const auto t = static_cast<uint8_t>(otsu_threshold(hist));
        for (size_t i = 0; i < pixels; ++i) {
            const uint8_t v = d[3 * i + 1] > t ? 255 : 0;
            d[3 * i] = d[3 * i + 1] = d[3 * i + 2] = v;
        }
    } else {
        count_levels(pixels, hist, [d](size_t i) { return word_gray(load16(d + 2 * i)); });
        const auto t = static_cast<uint8_t>(otsu_threshold(hist));
        for (size_t i = 0; i < pixels; ++i)
            store16(d + 2 * i, word_gray(load16(d + 2 * i)) > t ? 65535 : 0);
    }
    return 1;
}

} // extern "C"
