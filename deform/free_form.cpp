// Free-form warp: a rigid moving-least-squares deformation driven by control
// pairs, mapped forward pixel by pixel, with the holes that the forward
// mapping leaves filled from nearby written pixels.
#include <pxfx/deform.h>

#include <algorithm>
#include <cmath>
#include <cstring>
#include <optional>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/result.hpp"
#include "core/internal/view.hpp"
#include "deform/free_form.hpp"

using namespace pxfx;

namespace {

// A control pair in whole pixels: source (px, py), target (qx, qy).
struct ControlPoint {
    int32_t px, py, qx, qy;
};

// Farthest reach of the hole-filling searches, in pixels.
constexpr int32_t kReach = 5;

// True when trunc(v) lies in 0 .. n - 1 (false for NaN).
bool truncates_into(double v, int32_t n) { return n > 0 && v > -1.0 && v < static_cast<double>(n); }

bool inside(const DeformationPair &p, int32_t w, int32_t h) {
    return truncates_into(p.srcX, w) && truncates_into(p.srcY, h) && truncates_into(p.dstX, w) &&
           truncates_into(p.dstY, h);
}

// Rounded weighted centre from the sums of the weights and of the weighted
// coordinates; (0, 0) when the weights vanish.
PXPoint centroid(double s, double sx, double sy) {
    if (s < 1e-6) return {0, 0};
    return {trunc_sat<int32_t>(sx / s + 0.5), trunc_sat<int32_t>(sy / s + 0.5)};
}

struct Warp {
    View src, dst;
    int32_t w, h;
    const ControlPoint *pts;
    int32_t n;
    double *weights; // n rows of w: the weights of the current image row, pair by pair
    uint8_t *mask;   // w x h flags
};

// Maps every source pixel that is not a control source point to its new
// place; a later pixel landing on the same place overwrites an earlier one.
// The last column and row are never written.
template <class S, class D> void forward_map(const Warp &k) {
    const ControlPoint *pts = k.pts;
    const size_t w = static_cast<size_t>(k.w);
    for (int32_t y = 0; y < k.h; ++y) {
        for (int32_t i = 0; i < k.n; ++i)
            warp_row_weights(k.weights + i * w, k.w, y, pts[i].px, pts[i].py);
        const uint8_t *m = k.mask + static_cast<size_t>(y) * k.w;
        const typename S::CRow in = S::crow(k.src, y);
        for (int32_t x = 0; x < k.w; ++x) {
            if (m[x] & kSourcePoint) continue;
            // Indexed rather than offset: with no pair the weights are null.
            const size_t col = static_cast<size_t>(x);
            double s = 0.0, spx = 0.0, spy = 0.0, sqx = 0.0, sqy = 0.0;
            for (int32_t i = 0; i < k.n; ++i) {
                const double wi = k.weights[i * w + col];
                s += wi;
                spx += wi * pts[i].px;
                spy += wi * pts[i].py;
                sqx += wi * pts[i].qx;
                sqy += wi * pts[i].qy;
            }
            const PXPoint p = centroid(s, spx, spy), q = centroid(s, sqx, sqy);
            const int64_t dx = int64_t{x} - p.x, dy = int64_t{y} - p.y;
            double fx = 0.0, fy = 0.0;
            for (int32_t i = 0; i < k.n; ++i) {
                const int64_t phx = int64_t{pts[i].px} - p.x, phy = int64_t{pts[i].py} - p.y;
                const double qhx = static_cast<double>(int64_t{pts[i].qx} - q.x);
                const double qhy = static_cast<double>(int64_t{pts[i].qy} - q.y);
                const double wi = k.weights[i * w + col];
                const double wa = wi * static_cast<double>(phx * dx + phy * dy);
                const double wb = wi * static_cast<double>(phy * dx - phx * dy);
                const double wc = wi * static_cast<double>(phx * dy - phy * dx);
                fx += qhx * wa + qhy * wb;
                fy += qhx * wc + qhy * wa;
            }
            int32_t nx, ny;
            if (fx > -1e-6 && fx < 1e-6 && fy > -1e-6 && fy < 1e-6) {
                if (q.x < 0 || q.x >= k.w - 1 || q.y < 0 || q.y >= k.h - 1) continue;
                nx = q.x;
                ny = q.y;
            } else {
                // The direction of (fx, fy) with the length of v - p*, from q*.
                const double len = std::sqrt(static_cast<double>(dx * dx + dy * dy) / (fx * fx + fy * fy));
                const double vx = fx * len + q.x + 0.5, vy = fy * len + q.y + 0.5;
                if (!truncates_into(vx, k.w - 1) || !truncates_into(vy, k.h - 1)) continue;
                nx = static_cast<int32_t>(vx);
                ny = static_cast<int32_t>(vy);
            }
            D::store(D::row(k.dst, ny), nx, S::load(in, x));
            k.mask[static_cast<size_t>(ny) * k.w + nx] |= kKnown;
        }
    }
}

// trunc(c0 (1 - t) + c1 t + 0.5) per colour channel, capped at 255.
uint32_t mix2(uint32_t c0, uint32_t c1, double t, uint32_t alpha) {
    uint32_t out = alpha << 24;
    for (uint32_t shift = 0; shift < 24; shift += 8) {
        const double v = ((c0 >> shift) & 255) * (1.0 - t) + ((c1 >> shift) & 255) * t + 0.5;
        out |= std::min(static_cast<uint32_t>(v), 255u) << shift;
    }
    return out;
}

// Bilinear form of mix2 over four corners: horizontal weight a, vertical b.
uint32_t mix4(uint32_t c00, uint32_t c10, uint32_t c01, uint32_t c11, double a, double b, uint32_t alpha) {
    uint32_t out = alpha << 24;
    for (uint32_t shift = 0; shift < 24; shift += 8) {
        const uint32_t v00 = (c00 >> shift) & 255, v10 = (c10 >> shift) & 255;
        const uint32_t v01 = (c01 >> shift) & 255, v11 = (c11 >> shift) & 255;
        const double v = ((v00 * (1.0 - a) + v10 * a) * (1.0 - b) + (v01 * (1.0 - a) + v11 * a) * b) + 0.5;
        out |= std::min(static_cast<uint32_t>(v), 255u) << shift;
    }
    return out;
}

// Hole filling over the result, in its own format. Filled pixels become known
// at once, so later holes of the same pass may use them. A filled pixel takes
// the alpha of its nearest source pixel (the left or upper one on a tie).
template <class D> struct Holes {
    View dst;
    uint8_t *mask;
    int32_t w, h;

    bool known(int32_t x, int32_t y) const { return (mask[static_cast<size_t>(y) * w + x] & kKnown) != 0; }
    uint32_t at(int32_t x, int32_t y) const { return D::load(D::crow(dst, y), x); }

    // Distance 1 .. kReach to the nearest known pixel in that direction, or 0.
    int32_t left(int32_t x, int32_t y) const {
        for (int32_t l = 1; l <= kReach && x - l >= 0; ++l)
            if (known(x - l, y)) return l;
        return 0;
    }
    int32_t right(int32_t x, int32_t y) const {
        for (int32_t r = 1; r <= kReach && x + r < w; ++r)
            if (known(x + r, y)) return r;
        return 0;
    }
    int32_t above(int32_t x, int32_t y) const {
        for (int32_t u = 1; u <= kReach && y - u >= 0; ++u)
            if (known(x, y - u)) return u;
        return 0;
    }
    int32_t below(int32_t x, int32_t y) const {
        for (int32_t d = 1; d <= kReach && y + d < h; ++d)
            if (known(x, y + d)) return d;
        return 0;
    }

    // Four corners (x - l, y - u), (x + r, y - u), (x - l, y + d), (x + r, y + d):
    // the nearest row below with known pixels on both sides, then the nearest
    // row above known at those same columns.
    bool corners(int32_t x, int32_t y, uint32_t &c) const {
        for (int32_t d = 1; d <= kReach && y + d < h; ++d) {
            const int32_t l = left(x, y + d), r = right(x, y + d);
            if (l == 0 || r == 0) continue;
            for (int32_t u = 1; u <= kReach && y - u >= 0; ++u) {
                if (!known(x - l, y - u) || !known(x + r, y - u)) continue;
                const uint32_t c00 = at(x - l, y - u), c10 = at(x + r, y - u);
                const uint32_t c01 = at(x - l, y + d), c11 = at(x + r, y + d);
                const uint32_t top = l <= r ? c00 : c10, bottom = l <= r ? c01 : c11;
                const double a = static_cast<double>(l) / (l + r), b = static_cast<double>(u) / (u + d);
                c = mix4(c00, c10, c01, c11, a, b, alpha_of(u <= d ? top : bottom));
                return true;
            }
        }
        return false;
    }

    bool fill(int32_t x, int32_t y) const {
        uint32_t c;
        if (!corners(x, y, c)) {
            if (const int32_t l = left(x, y), r = right(x, y); l != 0 && r != 0) {
                const uint32_t cl = at(x - l, y), cr = at(x + r, y);
                c = mix2(cl, cr, static_cast<double>(l) / (l + r), alpha_of(l <= r ? cl : cr));
            } else if (const int32_t u = above(x, y), d = below(x, y); u != 0 && d != 0) {
                const uint32_t ca = at(x, y - u), cb = at(x, y + d);
                c = mix2(ca, cb, static_cast<double>(u) / (u + d), alpha_of(u <= d ? ca : cb));
            } else {
                return false;
            }
        }
        D::store(D::row(dst, y), x, c);
        mask[static_cast<size_t>(y) * w + x] |= kKnown;
        return true;
    }

    void run() const {
        for (int32_t y = 0; y < h; ++y)
            for (int32_t x = 0; x < w; ++x)
                if (!known(x, y)) fill(x, y);
    }
};

template <class S, class D> void warp(const Warp &k) {
    // Background by the green byte of the source's top-left pixel.
    const int bg = green_of(S::load(S::crow(k.src, 0), 0)) != 0 ? 255 : 0;
    std::memset(k.dst.bits, bg, k.dst.block_bytes());
    for (int32_t i = 0; i < k.n; ++i) {
        const ControlPoint &c = k.pts[i];
        k.mask[static_cast<size_t>(c.py) * k.w + c.px] |= kSourcePoint;
        k.mask[static_cast<size_t>(c.qy) * k.w + c.qx] |= kKnown;
        D::store(D::row(k.dst, c.qy), c.qx, S::load(S::crow(k.src, c.py), c.px));
    }
    forward_map<S, D>(k);
}

} // namespace

namespace pxfx {

// d^2 is symmetric about the point's column: weights computed left of it are
// reused on the right.
void warp_row_weights(double *wr, int32_t w, int32_t y, int32_t px, int32_t py) {
    const int64_t dy = int64_t{y} - py, dy2 = dy * dy;
    auto weight = [&](int32_t x) {
        const int64_t dx = int64_t{x} - px, d2 = dx * dx + dy2;
        return d2 == 0 ? 0.0 : 1.0 / std::exp(std::log(static_cast<double>(d2)));
    };
    const int32_t mirrored = static_cast<int32_t>(std::min<int64_t>(w, int64_t{2} * px + 1));
    int32_t x = 0;
    for (; x < w && x <= px; ++x)
        wr[x] = weight(x);
    for (; x < mirrored; ++x)
        wr[x] = wr[int64_t{2} * px - x];
    for (; x < w; ++x)
        wr[x] = weight(x);
}

void fill_warp_holes(const View &dst, uint8_t *mask) {
    with_format(dst.bitCount, [&](auto f) { Holes<decltype(f)>{dst, mask, dst.width, dst.height}.run(); });
}

} // namespace pxfx

extern "C" {

PXPoint WeightedCentroid(const int32_t *points, const double *weights, int32_t count) {
    double s = 0.0, sx = 0.0, sy = 0.0;
    if (points != nullptr && weights != nullptr) {
        for (int32_t i = 0; i < count; ++i) {
            s += weights[i];
            sx += weights[i] * points[2 * static_cast<size_t>(i)];
            sy += weights[i] * points[2 * static_cast<size_t>(i) + 1];
        }
    }
    return centroid(s, sx, sy);
}

int32_t DeformationFunc(Image *src, Image *dst, const DeformationPair *pairs, int32_t count) {
    if (src == nullptr || dst == nullptr || src->width != dst->width || src->height != dst->height ||
        (count > 0 && pairs == nullptr) || dst->bits == nullptr || !rows_inside(src) || !rows_inside(dst))
        return 0;
    // A negative count names no pair: the warp runs without any.
    if (count < 0) count = 0;
    const int32_t w = src->width, h = src->height;
    if (w <= 0 || h <= 0) {
        // No pixel to map: only the background fill of the block claimed,
        // black since no source pixel can be read.
        if (h > 0 && block_claim_ok(dst)) std::memset(dst->bits, 0, block_bytes(dst));
        return 1;
    }
    // A source without pixels reads as 0 everywhere. The result has pixels:
    // it has the source's size, and its rows lie inside its block.
    const ReadView view(src);
    const View to = *view_of(dst);
    int32_t n = 0;
    for (int32_t i = 0; i < count; ++i)
        n += inside(pairs[i], w, h);
    Buffer<ControlPoint> pts = alloc_buffer<ControlPoint>(static_cast<size_t>(n));
    Buffer<double> weights = alloc_buffer<double>(checked_size(static_cast<uint64_t>(n), static_cast<uint64_t>(w)));
    Buffer<uint8_t> mask = alloc_zeroed<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!view.ok() || !mask || (n > 0 && (!pts || !weights))) return 0;
    for (int32_t i = 0, j = 0; i < count; ++i) {
        const DeformationPair &p = pairs[i];
        if (!inside(p, w, h)) continue;
        pts[j++] = {static_cast<int32_t>(p.srcX), static_cast<int32_t>(p.srcY), static_cast<int32_t>(p.dstX),
                    static_cast<int32_t>(p.dstY)};
    }
    const Warp k{view.view(), to, w, h, pts.get(), n, weights.get(), mask.get()};
    with_formats(k.src, k.dst, [&](auto s, auto d) { warp<decltype(s), decltype(d)>(k); });
    fill_warp_holes(to, mask.get());
    return 1;
}

int32_t DeformationImage(Image *src, const DeformationPair *pairs, uint32_t count, Image **dst) {
    // A count above 2^31 - 1 reaches the warp as a negative one: no pair.
    const int32_t n = count > static_cast<uint32_t>(INT32_MAX) ? -1 : static_cast<int32_t>(count);
    if (src == nullptr || (n > 0 && pairs == nullptr)) return 0;
    Image *out = acquire_result(src, dst);
    if (out == nullptr) return 0;
    // A reused result without a pixel block takes nothing; one of an empty
    // size still gets the background over the block it claims.
    if (out->bits == nullptr) return 1;
    return DeformationFunc(src, out, pairs, n);
}

} // extern "C"
