// Oil painting: the mean colour of the dominant intensity class in a square
// window (imOil), and the posterised variant from quantised hue and lightness
// planes (imOil_1, ColorCompress).
#include <pxfx/color.h>
#include <pxfx/effects.h>

#include <bit>
#include <cstring>
#include <optional>
#include <type_traits>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/rank.hpp"
#include "core/internal/result.hpp"
#include "core/internal/vector_kernels.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

// Intensity class (306 R + 601 G + 117 B) >> 15: eight levels, 0..7.
constexpr int kClasses = 8;

constexpr uint32_t intensity_class(uint32_t c) {
    return (306 * red_of(c) + 601 * green_of(c) + 117 * blue_of(c)) >> 15;
}

// Pixel count and red, green and blue sums of each class in one histogram,
// class k at bins 4k .. 4k + 3 in that order, so that merging and sliding run
// over all bins in one pass and a pixel enters or leaves its class through
// four neighbouring bins. `S` holds the sums of one window exactly: 16 or 32
// bits while (2r + 1)^2 * 255 fits, 64 bits beyond. 16-bit histograms, the
// layout of the vector windows, count each pixel as kUnit = 8.
constexpr int32_t kBins = 4;
template <class S> using Hist = rank::Histogram<kBins * kClasses, S>;
template <class S> constexpr S kUnit = std::is_same_v<S, uint16_t> ? vec::kOilCount : 1;

// The four bins of a pixel's class as one 64-bit word of 16-bit lanes (bins
// in memory order on either byte order): a column's bins never go below 0 or
// past 2^16, so adding or subtracting the word moves each lane alone.
uint64_t class_word(uint32_t c) {
    constexpr bool little = std::endian::native == std::endian::little;
    constexpr uint64_t n = kUnit<uint16_t>;
    const uint64_t r = red_of(c), g = green_of(c), b = blue_of(c);
    return little ? n | r << 16 | g << 32 | b << 48 : n << 48 | r << 32 | g << 16 | b;
}

template <class S> S *class_bins(Hist<S> &h, uint32_t c) {
    return h.bins + kBins * static_cast<int32_t>(intensity_class(c));
}

template <class S> void add_pixel(Hist<S> &h, uint32_t c) {
    S *bins = class_bins(h, c);
    if constexpr (sizeof(S) == 2) {
        uint64_t word;
        std::memcpy(&word, bins, 8);
        word += class_word(c);
        std::memcpy(bins, &word, 8);
    } else {
        bins[0] += 1, bins[1] += red_of(c), bins[2] += green_of(c), bins[3] += blue_of(c);
    }
}

template <class S> void remove_pixel(Hist<S> &h, uint32_t c) {
    S *bins = class_bins(h, c);
    if constexpr (sizeof(S) == 2) {
        uint64_t word;
        std::memcpy(&word, bins, 8);
        word -= class_word(c);
        std::memcpy(bins, &word, 8);
    } else {
        bins[0] -= 1, bins[1] -= red_of(c), bins[2] -= green_of(c), bins[3] -= blue_of(c);
    }
}

// The class counts of a histogram, as rank::most_frequent reads them.
template <class S> struct ClassCounts {
    const Hist<S> &h;
    S count(int32_t k) const { return h.bins[kBins * k]; }
};

// Mean colour of the most populated class, the lowest class on a tie: each
// sum divided (truncating) by the class's count through div(sum, count).
template <class S, class Div> uint32_t dominant(const Hist<S> &h, uint32_t alpha, const Div &div) {
    const S *bins = h.bins + kBins * rank::most_frequent(ClassCounts<S>{h}, 0, kClasses);
    const S n = bins[0] / kUnit<S>;
    return pack(div(bins[3], n), div(bins[2], n), div(bins[1], n), alpha);
}

// Border pixels (closer than r to an edge) are copied; interior pixels take
// the dominant class of their (2r + 1)^2 window. The window is the sum of
// per-column histograms over rows y - r .. y + r; moving right adds one
// column and subtracts another, so the cost per pixel does not depend on r.
// A row runs in chunks of columns: before a chunk's windows read them, the
// columns they will add move down one row in one pass (the row that left
// the window out, the entering row in), so each column is updated once per
// row while in cache, and never just before a window reads it whole.
// Windows with 16-bit sums, whose divisions go through `reciprocal`, slide in
// the target's vectors where it has them (vec::oil_windows).
template <class F, class S, class Div>
void oil(const View &src, const View &dst, int32_t r, Hist<S> *cols, const Div &div,
         const ExactDivisor *reciprocal = nullptr) {
    constexpr int32_t kChunk = 64;
    const int32_t w = src.width, h = src.height;
    vec::OilWindows vector = nullptr;
    vec::OilMoves moves = nullptr;
    constexpr int32_t kPixelBytes = F::kBitCount / 8;
    if constexpr (std::is_same_v<S, uint16_t>) {
        static_assert(sizeof(Hist<S>) == vec::kOilBins * sizeof(uint16_t));
        if (reciprocal != nullptr) vector = vec::oil_windows();
        if constexpr (kPixelBytes >= 3) moves = vec::oil_moves(kPixelBytes);
    }
    uint32_t colours[kChunk];
    for (int32_t x = 0; x < w; ++x)
        cols[x] = Hist<S>{};
    for (int32_t y = 0; y < 2 * r; ++y) {
        const typename F::CRow in = F::crow(src, y);
        for (int32_t x = 0; x < w; ++x)
            add_pixel(cols[x], F::load(in, x));
    }
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(src, y);
        const typename F::Row out = F::row(dst, y);
        if (y < r || y >= h - r) {
            for (int32_t x = 0; x < w; ++x)
                F::store(out, x, F::load(in, x));
            continue;
        }
        // Columns below `moved` cover rows y - r .. y + r, the others still
        // y - r - 1 .. y + r - 1 (the first interior row: 0 .. 2r - 1).
        const typename F::CRow enter = F::crow(src, y + r);
        int32_t moved = 0;
        auto move_until = [&](int32_t end) {
            if (y == r) {
                for (; moved < end; ++moved)
                    add_pixel(cols[moved], F::load(enter, moved));
                return;
            }
            const typename F::CRow leave = F::crow(src, y - r - 1);
            if constexpr (F::kDirect && std::is_same_v<S, uint16_t>) {
                if (moves != nullptr)
                    moved += static_cast<int32_t>(moves(leave + kPixelBytes * moved, enter + kPixelBytes * moved,
                                                        static_cast<size_t>(end - moved), cols[moved].bins));
            }
            for (; moved < end; ++moved) {
                remove_pixel(cols[moved], F::load(leave, moved));
                add_pixel(cols[moved], F::load(enter, moved));
            }
        };
        for (int32_t x = 0; x < r; ++x)
            F::store(out, x, F::load(in, x));
        move_until(2 * r + 1);
        Hist<S> win{};
        for (int32_t x = 0; x <= 2 * r; ++x)
            win.merge(cols[x]);
        F::store(out, r, dominant(win, alpha_of(F::load(in, r)), div));
        for (int32_t first = r + 1; first < w - r; first += kChunk) {
            const int32_t end = first + kChunk < w - r ? first + kChunk : w - r;
            move_until(end + r);
            if constexpr (std::is_same_v<S, uint16_t>) {
                if (vector != nullptr) {
                    vector(cols[0].bins, static_cast<size_t>(r), static_cast<size_t>(first), static_cast<size_t>(end),
                           win.bins, reciprocal, colours);
                    for (int32_t x = first; x < end; ++x)
                        F::store(out, x, colours[x - first] | alpha_of(F::load(in, x)) << 24);
                    continue;
                }
            }
            for (int32_t x = first; x < end; ++x) {
                win.slide(cols[x + r], cols[x - r - 1]);
                F::store(out, x, dominant(win, alpha_of(F::load(in, x)), div));
            }
        }
        for (int32_t x = w - r; x < w; ++x)
            F::store(out, x, F::load(in, x));
    }
}

// Windows of at most 4096 pixels: every division of a class's sum by its
// count is a multiply by that count's exact reciprocal.
template <class F, class S> bool oil_with_reciprocals(const View &src, const View &dst, int32_t r) {
    const auto area = static_cast<uint32_t>((2 * r + 1) * (2 * r + 1));
    Buffer<ExactDivisor> reciprocal = alloc_buffer<ExactDivisor>(area + 1);
    Buffer<Hist<S>> cols = alloc_buffer<Hist<S>>(static_cast<size_t>(src.width));
    if (!reciprocal || !cols) return false;
    for (uint32_t n = 0; n <= area; ++n)
        reciprocal[n] = exact_divisor(n > 0 ? n : 1);
    const ExactDivisor *table = reciprocal.get();
    oil<F>(
        src, dst, r, cols.get(), [table](uint32_t s, uint32_t n) { return table[n].divide(s); }, table);
    return true;
}

template <class F> bool oil_with_sums(const View &src, const View &dst, int32_t r) {
    const uint64_t side = 2 * static_cast<uint64_t>(r) + 1;
    // Windows of at most 257 pixels: sums and counts fit 16 bits, so a
    // column's histogram is one 64-byte line and the window slides in
    // eight-lane vectors.
    if (side * side * 255 <= 0xFFFF) return oil_with_reciprocals<F, uint16_t>(src, dst, r);
    if (side <= 64) return oil_with_reciprocals<F, uint32_t>(src, dst, r);
    if (side < 0x10000 && side * side * 255 <= 0xFFFFFFFFu) {
        Buffer<Hist<uint32_t>> cols = alloc_buffer<Hist<uint32_t>>(static_cast<size_t>(src.width));
        if (!cols) return false;
        oil<F>(src, dst, r, cols.get(), [](uint32_t s, uint32_t n) { return s / n; });
    } else {
        Buffer<Hist<uint64_t>> cols = alloc_buffer<Hist<uint64_t>>(static_cast<size_t>(src.width));
        if (!cols) return false;
        oil<F>(src, dst, r, cols.get(), [](uint64_t s, uint64_t n) { return static_cast<uint32_t>(s / n); });
    }
    return true;
}

// Channel planes of one call, released on every path.
struct Planes {
    Image *hue = nullptr, *saturation = nullptr, *lightness = nullptr, *alpha = nullptr;
    Planes() = default;
    Planes(const Planes &) = delete;
    Planes &operator=(const Planes &) = delete;
    ~Planes() {
        free_Image(&hue, 0);
        free_Image(&saturation, 0);
        free_Image(&lightness, 0);
        free_Image(&alpha, 0);
    }
};

constexpr int32_t kHslMode = 1;

} // namespace

extern "C" {

uint32_t imOil(Image *src, Image **dst, int32_t r) {
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    // A negative radius leaves no first interior pixel at which the window
    // would be set up: refused like a window larger than the picture.
    if (r < 0 || 2 * static_cast<int64_t>(r) >= src->width || 2 * static_cast<int64_t>(r) >= src->height) return 0;
    const std::optional<View> to = view_of(out);
    if (!to) return 1;
    const View from = *view_of(src); // the result's size: the source has pixels too
    return with_format(from.bitCount, [&](auto f) { return oil_with_sums<decltype(f)>(from, *to, r); }) ? 1 : 0;
}

uint32_t imOil_1(Image *src, Image **dst) {
    const std::optional<View> from = view_of(src);
    if (!from || (from->bitCount != 24 && from->bitCount != 32) || dst == nullptr) return 0;
    Planes p;
    const bool alpha = from->bitCount == 32;
    if (!Split(src, &p.hue, &p.saturation, &p.lightness, alpha ? &p.alpha : nullptr, kHslMode)) return 0;
    ColorCompress(p.hue, 3);
    ColorCompress(p.lightness, 12);
    *dst = Combine(p.hue, p.saturation, p.lightness, p.alpha, kHslMode);
    return 1;
}

int32_t ColorCompress(Image *plane, int32_t levels) {
    if (plane == nullptr || plane->bits == nullptr || plane->bitCount != 8 || !rows_inside(plane) || levels < 1)
        return 0;
    // A plane of an empty size has nothing to compress.
    const std::optional<View> v = view_of(plane);
    if (!v) return 1;
    const int32_t group = 256 / levels + (256 % levels != 0 ? 1 : 0);
    rank::Histogram<256, uint32_t> count;
    count.reset();
    for (int32_t y = 0; y < v->height; ++y) {
        const uint8_t *row = v->row(y);
        for (int32_t x = 0; x < v->width; ++x)
            count.add(row[x]);
    }
    // Each group of `group` consecutive values maps to its most frequent
    // member, the first one on a tie.
    uint8_t map[256];
    for (int32_t first = 0; first < 256; first += group) {
        const int32_t end = first + group < 256 ? first + group : 256;
        const int32_t rep = rank::most_frequent(count, first, end);
        for (int32_t v = first; v < end; ++v)
            map[v] = static_cast<uint8_t>(rep);
    }
    for (int32_t y = 0; y < v->height; ++y) {
        uint8_t *row = v->row(y);
        for (int32_t x = 0; x < v->width; ++x)
            row[x] = map[row[x]];
    }
    return 1;
}

} // extern "C"
