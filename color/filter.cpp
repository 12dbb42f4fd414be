// Square-kernel convolution (Filter) and the four 3 x 3 kernel effects.
//
// The filter works a row at a time: every non-zero tap adds its weighted
// source row into 32-bit row sums (wrapping as 32-bit integers do), the part
// of the row whose reads stay inside the picture in one contiguous loop and
// the parts that fall off either edge with the edge pixel. Sums are finished
// per pixel: divided, offset, clamped.
#include <pxfx/color.h>

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"

using namespace pxfx;

namespace {

struct Tap {
    int32_t dx, dy;
    uint32_t weight;
};

// The non-zero taps of a size x size kernel. Offsets beyond reach - 1 (in
// either direction) read the same clamped pixel for every output pixel, so
// they are folded onto offset +-(reach - 1) and their weights added; this keeps
// the work bounded by the picture whatever the kernel size.
struct Taps {
    Buffer<Tap> list;
    size_t count = 0;
    bool ok = true;

    Taps(const int32_t *kernel, int32_t size, int32_t reachX, int32_t reachY) {
        if (size <= 0) return;
        const int32_t half = size / 2;
        auto fold = [](int32_t d, int32_t reach) { return std::clamp(d, 1 - reach, reach - 1); };
        const int32_t x0 = fold(-half, reachX), x1 = fold(size - half - 1, reachX);
        const int32_t y0 = fold(-half, reachY), y1 = fold(size - half - 1, reachY);
        const size_t gw = static_cast<size_t>(x1 - x0 + 1), gh = static_cast<size_t>(y1 - y0 + 1);
        Buffer<uint32_t> grid = alloc_zeroed<uint32_t>(checked_size(gw, gh));
        list = alloc_buffer<Tap>(checked_size(gw, gh));
        if (!grid || !list) {
            ok = false;
            return;
        }
        for (int32_t ky = 0; ky < size; ++ky) {
            const size_t gy = static_cast<size_t>(fold(ky - half, reachY) - y0);
            const int32_t *krow = kernel + static_cast<size_t>(ky) * static_cast<size_t>(size);
            for (int32_t kx = 0; kx < size; ++kx)
                grid[gy * gw + static_cast<size_t>(fold(kx - half, reachX) - x0)] += static_cast<uint32_t>(krow[kx]);
        }
        for (size_t gy = 0; gy < gh; ++gy)
            for (size_t gx = 0; gx < gw; ++gx)
                if (const uint32_t k = grid[gy * gw + gx]; k != 0)
                    list[count++] = {x0 + static_cast<int32_t>(gx), y0 + static_cast<int32_t>(gy), k};
    }
};

// sum / divisor (none for 0) + offset, clamped. The quotient of two 32-bit
// integers is exact in double and truncates like integer division.
struct Finish {
    double divisor;
    int64_t offset;
    // When every sum the taps can make lies in [low, low + span) without
    // wrapping, the results of all of them, indexed by sum - low.
    const uint8_t *table = nullptr;
    uint32_t low = 0;
    // When non-zero: every sum the taps can make is at least 0 and below
    // 2^16, and its result is (sum * mul) >> 16, which rows finish in vectors.
    uint16_t mul = 0;

    uint8_t slow(uint32_t acc) const {
        const int32_t sum = static_cast<int32_t>(acc);
        const int64_t q =
            divisor != 0.0 ? static_cast<int64_t>(static_cast<double>(sum) / divisor) : static_cast<int64_t>(sum);
        const int64_t v = q + offset;
        return static_cast<uint8_t>(v < 0 ? 0 : (v > 255 ? 255 : v));
    }
    // 32-bit sums, or 16-bit sums (only with the table: they equal the true
    // sums modulo 2^16, and so does their distance from low, which is below 2^16).
    template <class T> uint8_t operator()(T acc) const {
        if constexpr (sizeof(T) == 2)
            return table[static_cast<uint16_t>(acc - static_cast<uint16_t>(low))];
        else
            return table != nullptr ? table[acc - low] : slow(acc);
    }
};

// The results of n 16-bit sums into out: by the multiplier in one vector
// loop where it applies, else through the table.
void finish_row(const Finish &finish, const uint16_t *acc, size_t n, uint8_t *out) {
    if (finish.mul != 0) {
        const uint32_t mul = finish.mul;
        for (size_t j = 0; j < n; ++j)
            out[j] = static_cast<uint8_t>((acc[j] * mul) >> 16);
    } else {
        for (size_t j = 0; j < n; ++j)
            out[j] = finish(acc[j]);
    }
}

// Sums stay within this many values for the table of Finish to be built.
constexpr int64_t kMaxFinishTable = 1 << 16;

// Adds every tap's weighted source row to acc for output pixels x0 .. x1 - 1
// (S bytes per pixel, acc[0] for x0), reading with the edge rows and columns
// repeated. The taps of one kernel row (listed together, same dy) are added
// in one pass over the output pixels where all of them read inside the row;
// the pixels nearer the ends go one tap at a time with clamped columns.
template <int S, class T>
void accumulate(const View &src, const Taps &taps, int32_t y, int32_t x0, int32_t x1, T *acc) {
    const int32_t w = src.width, h = src.height;
    std::memset(acc, 0, sizeof(T) * S * static_cast<size_t>(x1 - x0));
    const ptrdiff_t first = static_cast<ptrdiff_t>(S) * x0; // acc index of output pixel x: S * x - first
    for (size_t g = 0; g < taps.count;) {
        const Tap *group = taps.list.get() + g;
        size_t n = 1;
        while (g + n < taps.count && group[n].dy == group[0].dy)
            ++n;
        g += n;
        const uint8_t *row = src.row(static_cast<int32_t>(std::clamp<int64_t>(int64_t{y} + group[0].dy, 0, h - 1)));
        int64_t lo = x0, hi = x1;
        for (size_t t = 0; t < n; ++t) {
            lo = std::max<int64_t>(lo, -int64_t{group[t].dx});
            hi = std::min<int64_t>(hi, int64_t{w} - group[t].dx);
        }
        lo = std::min<int64_t>(lo, x1);
        hi = std::max(hi, lo);
        for (size_t t = 0; t < n; ++t) {
            const T k = static_cast<T>(group[t].weight);
            const int64_t dx = group[t].dx;
            auto edge = [&](int64_t a, int64_t b) {
                for (int64_t x = a; x < b; ++x) {
                    const uint8_t *p =
                        row + static_cast<size_t>(S) * static_cast<size_t>(std::clamp<int64_t>(x + dx, 0, w - 1));
                    for (int c = 0; c < S; ++c)
                        acc[S * x + c - first] = static_cast<T>(acc[S * x + c - first] + k * p[c]);
                }
            };
            edge(x0, lo);
            edge(hi, x1);
        }
        const ptrdiff_t j0 = static_cast<ptrdiff_t>(S) * lo, j1 = static_cast<ptrdiff_t>(S) * hi;
        if (n == 3) {
            const ptrdiff_t s0 = ptrdiff_t{S} * group[0].dx, s1 = ptrdiff_t{S} * group[1].dx,
                            s2 = ptrdiff_t{S} * group[2].dx;
            const T k0 = static_cast<T>(group[0].weight), k1 = static_cast<T>(group[1].weight),
                    k2 = static_cast<T>(group[2].weight);
            if (k0 == 1 && k1 == 1 && k2 == 1) {
                for (ptrdiff_t j = j0; j < j1; ++j)
                    acc[j - first] = static_cast<T>(acc[j - first] + row[j + s0] + row[j + s1] + row[j + s2]);
            } else {
                for (ptrdiff_t j = j0; j < j1; ++j)
                    acc[j - first] =
                        static_cast<T>(acc[j - first] + k0 * row[j + s0] + k1 * row[j + s1] + k2 * row[j + s2]);
            }
            continue;
        }
        for (size_t t = 0; t < n; ++t) {
            const T k = static_cast<T>(group[t].weight);
            const ptrdiff_t shift = ptrdiff_t{S} * group[t].dx;
            if (k == 1) {
                for (ptrdiff_t j = j0; j < j1; ++j)
                    acc[j - first] = static_cast<T>(acc[j - first] + row[j + shift]);
            } else {
                for (ptrdiff_t j = j0; j < j1; ++j)
                    acc[j - first] = static_cast<T>(acc[j - first] + k * row[j + shift]);
            }
        }
    }
}

// Output pixels per accumulation pass, so that the sums stay in the L1 cache.
constexpr int32_t kChunk = 1024;

// The bytes of a mask that selects pixels of an 8-bit destination: the block
// the mask claims, `bytes` bytes (none for no mask, or a mask without pixels:
// every pixel is then selected) in rows of `pitch` bytes.
struct MaskBytes {
    const uint8_t *bits;
    uint64_t pitch;
    size_t bytes;
};

struct Job {
    View src; // 8-bit for an 8-bit destination, else 24- or 32-bit
    View dst;
    MaskBytes mask;
    int32_t width, height;
    int32_t lastDx, lastDy; // the bottom-right tap, whose alpha a 32-bit result takes
    bool anyTap;
    bool gray;
    Finish finish;
};

// Mask byte at (x, y) read from the mask's rows, y * pitch + x bytes into its
// block (past the end of a row, the next row's bytes); bytes beyond the block
// it claims count as set.
bool selected(const MaskBytes &mask, int32_t x, int32_t y) {
    const uint64_t at = static_cast<uint64_t>(y) * mask.pitch + static_cast<uint64_t>(x);
    return at >= mask.bytes || mask.bits[at] != 0;
}

template <class T> void filter_index(const Job &job, const Taps &taps, T *acc) {
    const View &src = job.src;
    const Finish finish = job.finish; // a local copy: result stores cannot alias its table
    for (int32_t y = 0; y < job.height; ++y) {
        uint8_t *out = job.dst.row(y);
        const uint8_t *own = src.row(std::min(y, src.height - 1));
        for (int32_t x0 = 0; x0 < job.width; x0 += kChunk) {
            const int32_t x1 = std::min(job.width, x0 + kChunk);
            accumulate<1>(src, taps, y, x0, x1, acc);
            for (int32_t x = x0; x < x1; ++x) {
                if (job.mask.bytes != 0 && !selected(job.mask, x, y))
                    out[x] = own[std::min(x, src.width - 1)];
                else
                    out[x] = finish(acc[x - x0]);
            }
        }
    }
}

// Moves finished colour pixels x0 .. x1 - 1 into the result row where that is
// a plain copy: all of them for 24-bit pixels, and for 32-bit ones those whose
// alpha pixel (lastDx further on) lies in the row, the colour and alpha
// bytes merged a word at a time. Returns the first pixel not placed.
template <int S, int D>
int32_t place_finished(const Job &job, const uint8_t *done, const uint8_t *alphaRow, uint8_t *out, int32_t x0,
                       int32_t x1) {
    if constexpr (S == 3 && D == 3) {
        std::memcpy(out + 3 * static_cast<size_t>(x0), done, 3 * static_cast<size_t>(x1 - x0));
        return x1;
    } else if constexpr (S == 4 && D == 4) {
        if (!job.anyTap) return x0;
        const int32_t hi = static_cast<int32_t>(std::clamp<int64_t>(int64_t{job.src.width} - job.lastDx, x0, x1));
        const uint8_t colourBytes[4] = {0xFF, 0xFF, 0xFF, 0};
        uint32_t colour;
        std::memcpy(&colour, colourBytes, 4);
        const uint8_t *alpha = alphaRow + 4 * static_cast<ptrdiff_t>(job.lastDx);
        for (int32_t x = x0; x < hi; ++x) {
            uint32_t c, a;
            std::memcpy(&c, done + 4 * static_cast<size_t>(x - x0), 4);
            std::memcpy(&a, alpha + 4 * static_cast<size_t>(x), 4);
            c = (c & colour) | (a & ~colour);
            std::memcpy(out + 4 * static_cast<size_t>(x), &c, 4);
        }
        return hi;
    } else {
        return x0;
    }
}

template <int S, int D, class T> void filter_colour(const Job &job, const Taps &taps, T *acc, uint8_t *done) {
    const View &src = job.src;
    const Finish finish = job.finish; // a local copy: result stores cannot alias its table
    for (int32_t y = 0; y < job.height; ++y) {
        uint8_t *out = job.dst.row(y);
        const uint8_t *alphaRow = src.row(std::clamp(y + job.lastDy, 0, src.height - 1));
        for (int32_t x0 = 0; x0 < job.width; x0 += kChunk) {
            const int32_t x1 = std::min(job.width, x0 + kChunk);
            accumulate<S>(src, taps, y, x0, x1, acc);
            const ptrdiff_t first = static_cast<ptrdiff_t>(S) * x0;
            // 16-bit sums are finished for the whole chunk first.
            int32_t from = x0; // the first pixel left to the loop below
            if constexpr (sizeof(T) == 2) {
                finish_row(finish, acc, static_cast<size_t>(S) * (x1 - x0), done);
                if (!job.gray) from = place_finished<S, D>(job, done, alphaRow, out, x0, x1);
            }
            for (int32_t x = from; x < x1; ++x) {
                uint8_t b, g, r;
                if constexpr (sizeof(T) == 2) {
                    const uint8_t *f = done + (S * x - first);
                    b = f[0], g = f[1], r = f[2];
                } else {
                    const T *a = acc + (S * x - first);
                    b = finish(a[0]), g = finish(a[1]), r = finish(a[2]);
                }
                if (job.gray) b = g = r = static_cast<uint8_t>((b + 2 * g + r) >> 2);
                uint8_t *p = out + D * x;
                p[0] = b;
                p[1] = g;
                p[2] = r;
                if constexpr (D == 4) {
                    if (job.anyTap) {
                        const int32_t ax = std::clamp(x + job.lastDx, 0, src.width - 1);
                        p[3] = S == 4 ? alphaRow[4 * ax + 3] : 255;
                    }
                }
            }
        }
    }
}

bool overlaps(const View &a, const View &b) {
    const uintptr_t a0 = reinterpret_cast<uintptr_t>(a.bits), b0 = reinterpret_cast<uintptr_t>(b.bits);
    return a0 < b0 + b.block_bytes() && b0 < a0 + a.block_bytes();
}

// A source readable by the row loops: the picture itself when its format is
// `want` (or 24/32 for colour), else a copy made through the pixel readers
// (GetPixelIndex for index work, GetPixelColor as 32 bits for colour work).
// A picture of an empty size (no view) reads as 0 everywhere: one zero pixel,
// which the clamped reads repeat. A direct source sharing pixels with dst is
// read from a snapshot.
struct Source {
    View view{};
    ImagePtr converted;
    Buffer<uint8_t> snapshot;

    bool prepare(const std::optional<View> &from, bool index, const View &dst) {
        if (!from) {
            converted = make_image(1, 1, index ? 8 : 32);
            if (!converted) return false;
            view = *view_of(converted.get());
            std::memset(view.bits, 0, view.pitch);
            return true;
        }
        const View &src = *from;
        view = src;
        const bool direct = index ? src.bitCount == 8 : (src.bitCount == 24 || src.bitCount == 32);
        if (direct) {
            if (!overlaps(src, dst)) return true;
            snapshot = alloc_buffer<uint8_t>(src.block_bytes());
            if (!snapshot) return false;
            std::memcpy(snapshot.get(), src.bits, src.block_bytes());
            view.bits = snapshot.get();
            return true;
        }
        converted = make_image(src.width, src.height, index ? 8 : 32);
        if (!converted) return false;
        view = *view_of(converted.get());
        for (int32_t y = 0; y < src.height; ++y) {
            uint8_t *row = view.row(y);
            for (int32_t x = 0; x < src.width; ++x) {
                if (index)
                    row[x] = GetPixelIndex(src.record, x, y);
                else
                    Bgra32::store(row, x, GetPixelColor(src.record, x, y));
            }
        }
        return true;
    }
};

// Filters src into dst; src has a pixel block and may be of an empty size
// (the sizes it claims still bound the taps). The kernel is checked only where
// taps are read.
int32_t run_filter(const Image *src, const int32_t *kernel, int32_t size, int32_t divisor, int32_t offset,
                   const Image *mask, const View &dst, int32_t gray) {
    const uint32_t bits = dst.bitCount;
    if (bits != 8 && bits != 24 && bits != 32) return 1;
    // An 8-bit mask limits the area to its size, with or without pixels; a
    // mask whose rows overrun its block is ignored.
    if (mask != nullptr && !rows_inside(mask)) mask = nullptr;
    int32_t width = dst.width, height = dst.height;
    if (mask != nullptr && mask->bitCount == 8) {
        width = std::min(width, mask->width);
        height = std::min(height, mask->height);
    }
    if (width <= 0 || height <= 0) return 1;
    if (size > 0 && (kernel == nullptr || checked_size(static_cast<uint64_t>(size), static_cast<uint64_t>(size)) == 0))
        return 0;
    Source source;
    if (!source.prepare(view_of(src), bits == 8, dst)) return 0;
    const Taps taps(kernel, size, std::max(width, src->width), std::max(height, src->height));
    if (!taps.ok) return 0;
    Finish finish{divisor == 0 ? 0.0 : static_cast<double>(divisor), offset};
    // Bounds of the sums from the signed weights; beyond 32 bits they may wrap.
    int64_t low = 0, high = 0;
    for (size_t t = 0; t < taps.count; ++t)
        (static_cast<int32_t>(taps.list[t].weight) < 0 ? low : high) +=
            255 * int64_t{static_cast<int32_t>(taps.list[t].weight)};
    Buffer<uint8_t> table;
    if (high - low < kMaxFinishTable && low > INT32_MIN && high < INT32_MAX)
        table = alloc_buffer<uint8_t>(static_cast<size_t>(high - low + 1));
    if (table) {
        for (int64_t v = low; v <= high; ++v)
            table[static_cast<size_t>(v - low)] = finish.slow(static_cast<uint32_t>(v));
        finish.table = table.get();
        finish.low = static_cast<uint32_t>(low);
        // A positive divisor without offset: try the rounded-up reciprocal,
        // kept only when it gives every entry of the table.
        if (divisor > 0 && offset == 0 && low == 0) {
            const uint32_t mul = (65536u + static_cast<uint32_t>(divisor) - 1) / static_cast<uint32_t>(divisor);
            bool exact = mul < 65536u;
            for (int64_t v = 0; v <= high && exact; ++v)
                exact = ((static_cast<uint32_t>(v) * mul) >> 16) == table[static_cast<size_t>(v)];
            if (exact) finish.mul = static_cast<uint16_t>(mul);
        }
    }
    const Image *selector = bits == 8 ? mask : nullptr;
    const MaskBytes selection =
        selector != nullptr && selector->bits != nullptr && selector->height > 0 && block_claim_ok(selector)
            ? MaskBytes{selector->bits, selector->pitch, block_bytes(selector)}
            : MaskBytes{nullptr, 0, 0};
    const int32_t last = size - size / 2 - 1; // offset of the bottom-right tap
    Job job{source.view, dst, selection, width, height, last, last, size > 0, gray >= 1, finish};
    // 16-bit sums when the table covers them: twice as many per vector.
    auto run = [&](auto zero) {
        using T = decltype(zero);
        const size_t chunk = checked_size(static_cast<uint64_t>(std::min(width, kChunk)), 4);
        Buffer<T> acc = alloc_buffer<T>(chunk);
        Buffer<uint8_t> done = alloc_buffer<uint8_t>(chunk);
        if (!acc || !done) return 0;
        if (bits == 8) {
            filter_index(job, taps, acc.get());
        } else {
            const bool four = source.view.bitCount == 32;
            uint8_t *d = done.get();
            if (bits == 24)
                four ? filter_colour<4, 3>(job, taps, acc.get(), d) : filter_colour<3, 3>(job, taps, acc.get(), d);
            else
                four ? filter_colour<4, 4>(job, taps, acc.get(), d) : filter_colour<3, 4>(job, taps, acc.get(), d);
        }
        return 1;
    };
    return finish.table != nullptr ? run(uint16_t{}) : run(uint32_t{});
}

// The 3 x 3 kernels of the effects, rows top to bottom.
const int32_t kBlur[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
const int32_t kSoften[9] = {1, 1, 1, 1, 8, 1, 1, 1, 1};
const int32_t kSharpen[9] = {-1, -1, -1, -1, 15, -1, -1, -1, -1};
const int32_t kEmboss[9] = {0, 0, -1, 0, 0, 0, 1, 0, 0};

int32_t kernel_effect(const Image *src, Image **out, const int32_t *kernel, int32_t divisor, int32_t offset,
                      int32_t gray) {
    Image *dst = acquire_result(src, out);
    if (dst == nullptr) return 0;
    return Filter(const_cast<Image *>(src), kernel, 3, divisor, offset, nullptr, dst, gray);
}

} // namespace

extern "C" {

int32_t Filter(Image *src, const int32_t *kernel, int32_t size, int32_t divisor, int32_t offset, const Image *mask,
               Image *dst, int32_t gray) {
    if (src == nullptr || src->bits == nullptr || !rows_inside(src)) return 0;
    if (dst != nullptr) {
        // A destination without pixels, or of an empty size, takes nothing;
        // a source of an empty size reads as 0.
        if (!rows_inside(dst)) return 0;
        const std::optional<View> to = view_of(dst);
        return to ? run_filter(src, kernel, size, divisor, offset, mask, *to, gray) : 1;
    }
    // In place: the working image of the source's size cannot be made for an
    // empty size.
    ImagePtr work = make_image(src->width, src->height, static_cast<int32_t>(src->bitCount));
    if (!work || run_filter(src, kernel, size, divisor, offset, mask, *view_of(work.get()), gray) == 0) return 0;
    PX_Img_Copy(src, work.get());
    return 1;
}

int32_t PX_IMG_Blur(const Image *src, Image **out) { return kernel_effect(src, out, kBlur, 9, 0, 0); }
int32_t PX_IMG_Soften(const Image *src, Image **out) { return kernel_effect(src, out, kSoften, 16, 0, 0); }
int32_t PX_IMG_Sharpen(const Image *src, Image **out) { return kernel_effect(src, out, kSharpen, 7, 0, 0); }
int32_t PX_IMG_Emboss1(const Image *src, Image **out) { return kernel_effect(src, out, kEmboss, 0, 127, 1); }

} // extern "C"
