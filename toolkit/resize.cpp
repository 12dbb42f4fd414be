// Bilinear resize of packed images and the two exported plane
// interpolations. The source coordinate of destination index i is i / r with
// r = source size / destination size (the inverse of the usual mapping), all
// in single precision.
#include <pxfx/toolkit.h>

#include <algorithm>
#include <cmath>
#include <cstring>

#include "core/internal/memory.hpp"
#include "core/internal/vector_kernels.hpp"
#include "toolkit/pximage_check.hpp"
#include "toolkit/resize_internal.hpp"

using namespace pxfx;
using namespace pxfx::packed;

namespace pxfx::packed {

namespace {

constexpr float kMaxPlainWeight = 1048576.0f;

// The two source columns of every result column and their weights, one
// array each, so that the column loop can gather in vectors.
struct Taps {
    Buffer<int32_t> i0, i1; // clamped sample indices
    Buffer<float> w, omw;   // weight of i1 and 1 - weight
    explicit Taps(size_t n)
        : i0(alloc_buffer<int32_t>(n)), i1(alloc_buffer<int32_t>(n)), w(alloc_buffer<float>(n)),
          omw(alloc_buffer<float>(n)) {}
    bool ok() const { return i0 && i1 && w && omw; }
};

// The taps per result sample for the vector blend (vec::ResizeColumns): the
// offsets of the taps' bytes in a source row, the weights, and each group's
// load, shuffles and weights.
struct SampleTaps {
    Buffer<int32_t> i0, i1, from;
    Buffer<float> w, omw;
    Buffer<uint8_t> records; // holds the groups from its first 16-byte boundary on
    vec::ResizeColumns columns{};

    // For pixels of C samples in source rows of rowBytes bytes; false when
    // memory is missing.
    template <int C> bool build(const Taps &cols, int32_t dstWidth, size_t rowBytes) {
        const size_t n = static_cast<size_t>(dstWidth) * C, count = n / vec::kResizeGroup;
        constexpr size_t kAlign = alignof(vec::ResizeGroup);
        i0 = alloc_buffer<int32_t>(n), i1 = alloc_buffer<int32_t>(n), w = alloc_buffer<float>(n);
        omw = alloc_buffer<float>(n), from = alloc_buffer<int32_t>(count);
        // One record more leaves room to start at the boundary (0 bytes, no
        // buffer, when the size is out of range).
        records = alloc_buffer<uint8_t>(checked_size(count + 1, sizeof(vec::ResizeGroup)));
        if (!i0 || !i1 || !w || !omw || (count > 0 && !from) || !records) return false;
        const uintptr_t at = reinterpret_cast<uintptr_t>(records.get());
        auto *groups = reinterpret_cast<vec::ResizeGroup *>((at + kAlign - 1) / kAlign * kAlign);
        for (int32_t j = 0; j < dstWidth; ++j)
            for (int c = 0; c < C; ++c) {
                const size_t k = static_cast<size_t>(j) * C + c;
                i0[k] = cols.i0[j] * C + c, i1[k] = cols.i1[j] * C + c;
                w[k] = cols.w[j], omw[k] = cols.omw[j];
            }
        // A group loads the 16 bytes from its first tap, or the row's last 16
        // when they reach past the row, and takes the plain blend when its
        // taps do not fit them.
        constexpr int64_t kSpan = sizeof(vec::ResizeGroup::first);
        for (size_t g = 0; g < count; ++g) {
            const size_t k = g * vec::kResizeGroup;
            int32_t lo = i0[k], hi = i1[k];
            for (size_t s = k; s < k + vec::kResizeGroup; ++s)
                lo = std::min({lo, i0[s], i1[s]}), hi = std::max({hi, i0[s], i1[s]});
            const int64_t start = std::min<int64_t>(lo, static_cast<int64_t>(rowBytes) - kSpan);
            const bool fits = start >= 0 && hi - start < kSpan;
            from[g] = fits ? static_cast<int32_t>(start) : -1;
            vec::ResizeGroup &r = groups[g];
            std::memset(r.first, 0x80, sizeof r.first);
            std::memset(r.second, 0x80, sizeof r.second);
            for (size_t l = 0; l < vec::kResizeGroup; ++l) {
                if (fits) {
                    r.first[4 * l] = static_cast<uint8_t>(i0[k + l] - start);
                    r.second[4 * l] = static_cast<uint8_t>(i1[k + l] - start);
                }
                r.omw[l] = omw[k + l], r.w[l] = w[k + l];
            }
        }
        columns = {i0.get(), i1.get(), w.get(), omw.get(), from.get(), groups, n};
        return true;
    }
};

} // namespace

// One row across: h[j] = (1 - w) * f[i0] + w * f[i1] per result column j and
// sample. The buffers are distinct, which lets the single-sample loop gather.
template <int C>
inline void blend_columns(const float *__restrict f, const int32_t *__restrict i0, const int32_t *__restrict i1,
                          const float *__restrict w, const float *__restrict omw, int32_t n, float *__restrict h) {
    if constexpr (C == 1) {
        for (int32_t j = 0; j < n; ++j)
            h[j] = omw[j] * f[i0[j]] + w[j] * f[i1[j]];
    } else {
        for (int32_t j = 0; j < n; ++j) {
            const float *p0 = f + static_cast<size_t>(i0[j]) * C, *p1 = f + static_cast<size_t>(i1[j]) * C;
            for (int c = 0; c < C; ++c)
                h[static_cast<size_t>(j) * C + c] = omw[j] * p0[c] + w[j] * p1[c];
        }
    }
}

// The interpolation of a plane at a ratio of exactly 2 each way, where
// result index i reads source index i / 2 and every tap stays inside the
// source (the second one held at its last row or column): every weight is 0
// or 1/2, and every product and sum of the float blends is exact, so each
// result is the floored mean of one, two or four samples. Result columns 2k
// and 2k + 1 of a row take column sums v of source rows y and y' (y' = y for
// even result rows): v[k] / 2 and (v[k] + v[k + 1]) / 4.
namespace {

void floored_means(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                   int32_t dstHeight) {
    // Pairs k whose k + 1 is a source column and whose odd result exists.
    const int32_t inner = std::min(srcWidth - 1, dstWidth / 2);
    for (int32_t i = 0; i < dstHeight; ++i) {
        const int32_t y = i / 2, y1 = i % 2 == 0 ? y : std::min(y + 1, srcHeight - 1);
        const uint8_t *__restrict t = src + static_cast<size_t>(y) * static_cast<size_t>(srcWidth);
        const uint8_t *__restrict u = src + static_cast<size_t>(y1) * static_cast<size_t>(srcWidth);
        uint8_t *__restrict out = dst + static_cast<size_t>(i) * static_cast<size_t>(dstWidth);
        for (int32_t k = 0; k < inner; ++k) {
            const uint32_t a = t[k] + u[k], b = t[k + 1] + u[k + 1];
            out[2 * k] = static_cast<uint8_t>(a >> 1);
            out[2 * k + 1] = static_cast<uint8_t>((a + b) >> 2);
        }
        for (int32_t k = inner; 2 * k < dstWidth; ++k) {
            const int32_t k1 = std::min(k + 1, srcWidth - 1);
            const uint32_t a = t[k] + u[k], b = t[k1] + u[k1];
            out[2 * k] = static_cast<uint8_t>(a >> 1);
            if (2 * k + 1 < dstWidth) out[2 * k + 1] = static_cast<uint8_t>((a + b) >> 2);
        }
    }
}

} // namespace

// Interpolates pixels of C interleaved samples (source pixel p at p * C,
// result pixel p at p * dstStride, its samples consecutive); every sample as
// interpolate_plane would on its own plane.
template <int C>
bool interpolate(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                 int32_t dstHeight, size_t dstStride, float ry, float rx) {
    // Planes only: the compilers vectorise this loop of single samples,
    // while three-sample pixels run faster through the blends' vector copy.
    if constexpr (C == 1) {
        if (rx == 2.0f && ry == 2.0f && dstStride == 1 && dstWidth > 0 && dstHeight > 0 &&
            (dstWidth - 1) / 2 < srcWidth && (dstHeight - 1) / 2 < srcHeight) {
            floored_means(src, srcWidth, srcHeight, dst, dstWidth, dstHeight);
            return true;
        }
    }
    Taps cols(static_cast<size_t>(dstWidth));
    if (!cols.ok()) return false;
    // With every column weight in 0..1 the row blends stay in 0..255 (no NaN).
    bool weightsInRange = true;
    int32_t used0 = srcWidth - 1, used1 = 0; // the source columns the taps read
    for (int32_t j = 0; j < dstWidth; ++j) {
        const float fx = static_cast<float>(j) / rx;
        const int32_t x0 = trunc_sat<int32_t>(fx);
        const float wx = fx - static_cast<float>(x0);
        cols.i0[j] = clamp_coord(x0, srcWidth), cols.i1[j] = clamp_coord(int64_t{x0} + 1, srcWidth);
        cols.w[j] = wx, cols.omw[j] = 1.0f - wx;
        weightsInRange = weightsInRange && wx >= 0.0f && wx <= 1.0f;
        used0 = std::min(used0, cols.i0[j]), used1 = std::max(used1, cols.i1[j]);
    }
    // Horizontally interpolated source rows (C samples per pixel, packed),
    // cached in two slots by row parity: consecutive output rows mostly reuse
    // one or both.
    const size_t n = static_cast<size_t>(dstWidth) * C;
    Buffer<float> across = alloc_buffer<float>(2 * n);
    if (!across) return false;
    // The vector blend reads the source bytes themselves; without its
    // working memory the plain blend runs.
    const vec::ResizeAcross vectorAcross = vec::resize_across();
    SampleTaps samples;
    const bool bytesAcross =
        vectorAcross != nullptr && samples.build<C>(cols, dstWidth, static_cast<size_t>(srcWidth) * C);
    // For the plain blend, one source row as floats (exact), converted once
    // per row in one pass, columns used0 .. used1 (the ones the taps read).
    Buffer<float> row;
    if (!bytesAcross) {
        row = alloc_buffer<float>(static_cast<size_t>(srcWidth) * C);
        if (!row) return false;
    }
    const vec::ResizeDown vectorDown = vec::resize_down();
    int32_t cached[2] = {-1, -1};
    const size_t srcRow = static_cast<size_t>(srcWidth) * C;
    const size_t dstRow = static_cast<size_t>(dstWidth) * dstStride;
    auto row_across = [&](int32_t y) {
        float *h = across.get() + static_cast<size_t>(y & 1) * n;
        if (cached[y & 1] == y) return static_cast<const float *>(h);
        const uint8_t *a = src + static_cast<size_t>(y) * srcRow;
        cached[y & 1] = y;
        if (bytesAcross) {
            vectorAcross(a, samples.columns, h);
            return static_cast<const float *>(h);
        }
        float *f = row.get();
        for (size_t k = static_cast<size_t>(used0) * C; k < static_cast<size_t>(used1 + 1) * C; ++k)
            f[k] = static_cast<float>(a[k]);
        blend_columns<C>(f, cols.i0.get(), cols.i1.get(), cols.w.get(), cols.omw.get(), dstWidth, h);
        return static_cast<const float *>(h);
    };
    for (int32_t i = 0; i < dstHeight; ++i) {
        const float fy = static_cast<float>(i) / ry;
        const int32_t y0 = trunc_sat<int32_t>(fy);
        const int32_t Y0 = clamp_coord(y0, srcHeight), Y1 = clamp_coord(int64_t{y0} + 1, srcHeight);
        // The vertical weight comes from the clamped row, so it exceeds 1
        // where the clamp held.
        const float wy = fy - static_cast<float>(Y0);
        const float omwy = 1.0f - wy;
        const float *top = row_across(Y0);
        const float *bottom = row_across(Y1);
        uint8_t *out = dst + static_cast<size_t>(i) * dstRow;
        // With the row blends in 0..255 and |wy| (so |1 - wy|) at most 2^20,
        // every result lies well inside int32, where the saturating
        // conversion to uint32 is a plain one held at 0.
        if (weightsInRange && std::fabs(wy) <= kMaxPlainWeight && dstStride == C) {
            for (size_t j = vectorDown != nullptr ? vectorDown(top, bottom, omwy, wy, n, out) : 0; j < n; ++j) {
                const auto v = static_cast<int32_t>(omwy * top[j] + wy * bottom[j]);
                out[j] = static_cast<uint8_t>(v < 0 ? 0 : v);
            }
        } else {
            for (int32_t j = 0; j < dstWidth; ++j)
                for (int c = 0; c < C; ++c)
                    out[static_cast<size_t>(j) * dstStride + c] = static_cast<uint8_t>(trunc_sat<uint32_t>(
                        omwy * top[static_cast<size_t>(j) * C + c] + wy * bottom[static_cast<size_t>(j) * C + c]));
        }
    }
    return true;
}

bool interpolate_plane(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                       int32_t dstHeight, size_t dstStride, float ry, float rx) {
    return interpolate<1>(src, srcWidth, srcHeight, dst, dstWidth, dstHeight, dstStride, ry, rx);
}

} // namespace pxfx::packed

namespace {

// What the plane interpolation does before touching a pixel: -1 when it goes
// on to interpolate, else its result. Null planes and sizes of 0 are refused
// (0); a destination of negative width or height has empty row or column
// loops, so nothing is read or written (1). A source of negative width or
// height has no pixel rows, and its clamped indices (the size - 1) point
// before the plane, so it is refused (0) whenever pixels would be written;
// so are planes above kMaxBlockBytes.
int32_t plane_outcome(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, const uint8_t *dst, int32_t dstWidth,
                      int32_t dstHeight) {
    if (src == nullptr || dst == nullptr || srcWidth == 0 || srcHeight == 0 || dstWidth == 0 || dstHeight == 0)
        return 0;
    if (dstWidth < 0 || dstHeight < 0) return 1;
    if (srcWidth < 0 || srcHeight < 0) return 0;
    const bool fits = checked_size(static_cast<uint64_t>(srcWidth), static_cast<uint64_t>(srcHeight)) != 0 &&
                      checked_size(static_cast<uint64_t>(dstWidth), static_cast<uint64_t>(dstHeight)) != 0;
    return fits ? -1 : 0;
}

} // namespace

extern "C" {

int32_t DualLinearIntepol(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                          int32_t dstHeight) {
    const int32_t outcome = plane_outcome(src, srcWidth, srcHeight, dst, dstWidth, dstHeight);
    if (outcome >= 0) return outcome;
    const float ry = static_cast<float>(srcHeight) / static_cast<float>(dstHeight);
    const float rx = static_cast<float>(srcWidth) / static_cast<float>(dstWidth);
    return interpolate_plane(src, srcWidth, srcHeight, dst, dstWidth, dstHeight, 1, ry, rx) ? 1 : 0;
}

int32_t DualLinearIntepol_KWB(const uint8_t *src, int32_t srcWidth, int32_t srcHeight, uint8_t *dst, int32_t dstWidth,
                              int32_t dstHeight, float scale) {
    if (dstWidth <= 0) return 0;
    const int32_t outcome = plane_outcome(src, srcWidth, srcHeight, dst, dstWidth, dstHeight);
    if (outcome >= 0) return outcome;
    return interpolate_plane(src, srcWidth, srcHeight, dst, dstWidth, dstHeight, 1, scale, scale) ? 1 : 0;
}

PXImage *PXImage_Resize(const PXImage *src, int32_t newWidth, int32_t newHeight) {
    if (src == nullptr || !px_rows_inside(src)) return nullptr;
    if (src->bitcount != 8 && src->bitcount != 16 && src->bitcount != 24) return nullptr;
    const int32_t outBits = src->bitcount == 8 ? 8 : 24;
    const int64_t bytes = block_size(newWidth, newHeight, px_bytes(outBits));
    if (bytes == kNoSize) return nullptr;
    // A new size of 0, or exactly one negative new size, asks for no block
    // (data null) and the interpolation writes nothing.
    PXImage *out = px_record(newWidth, newHeight, outBits, bytes);
    if (out == nullptr || bytes <= 0) return out;
    // Both new sizes negative: the block exists but the loops are empty. A
    // source without data or pixel rows gives the interpolation nothing to
    // read. Either way no result pixel is computed; the block is cleared.
    const std::optional<View> to = view_of(out), from = view_of(src);
    if (!to || !from) {
        std::memset(out->data, 0, static_cast<size_t>(bytes));
        return out;
    }
    const int32_t w = from->width, h = from->height;
    const float ry = static_cast<float>(h) / static_cast<float>(newHeight);
    const float rx = static_cast<float>(w) / static_cast<float>(newWidth);
    bool ok = true;
    if (from->bitCount == 8) {
        ok = interpolate_plane(from->bits, w, h, to->bits, newWidth, newHeight, 1, ry, rx);
    } else if (from->bitCount == 24) {
        ok = interpolate<3>(from->bits, w, h, to->bits, newWidth, newHeight, 3, ry, rx);
    } else {
        // A 16-bit source is read as three-byte pixels; the bytes that this
        // stride puts past the end of its block read as 0.
        const size_t n = static_cast<size_t>(w) * static_cast<size_t>(h);
        const size_t have = from->block_bytes();
        const uint8_t *block = from->bits;
        Buffer<uint8_t> plane = alloc_buffer<uint8_t>(n);
        ok = static_cast<bool>(plane);
        for (int32_t c = 0; c < 3 && ok; ++c) {
            for (size_t p = 0; p < n; ++p) {
                const size_t k = p * 3 + static_cast<size_t>(c);
                plane[p] = k < have ? block[k] : 0;
            }
            ok = interpolate_plane(plane.get(), w, h, to->bits + c, newWidth, newHeight, 3, ry, rx);
        }
    }
    if (!ok) {
        PXImage_Free(out);
        return nullptr;
    }
    return out;
}

} // extern "C"
