// Eye enlargement by vertical stretching inside an ellipse or a circle, and
// the automatic variant that finds both eyes as wide holes in the skin of the
// face band.
//
// The stretch runs in place: every pixel takes the colour of a pixel of its
// own column nearer to row cy, and the four quadrant passes run in a fixed
// order and direction so that each reads rows it has not rewritten yet.
#include <pxfx/retouch.h>

#include <algorithm>
#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/math.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

struct Box {
    int64_t x0, x1, y0, y1; // inclusive, inside the picture
};

uint32_t abs_diff(int64_t a, int64_t b) { return static_cast<uint32_t>(a > b ? a - b : b - a); }

// The stretch factor of a pixel, or 0 when it lies outside the shape.
struct EllipseShape {
    int64_t cy, a2, t, k, f1, f2;
    float factor(int64_t x, int64_t y) const {
        const int64_t e = static_cast<int64_t>(distance2d(static_cast<int32_t>(abs_diff(x, f1)),
                                                          static_cast<int32_t>(abs_diff(y, cy)))) +
                          distance2d(static_cast<int32_t>(abs_diff(x, f2)), static_cast<int32_t>(abs_diff(y, cy)));
        if (e > a2) return 0.0f;
        if (e <= t) return 1.2f;
        return 1.0f + static_cast<float>(a2 - e) * 0.2f / static_cast<float>(k) * 0.5f;
    }
    bool lower_left_ok(int64_t, int64_t) const { return true; }
};

struct CircleShape {
    int64_t cx, cy, r;
    int64_t dist(int64_t x, int64_t y) const {
        return distance2d(static_cast<int32_t>(abs_diff(x, cx)), static_cast<int32_t>(abs_diff(y, cy)));
    }
    float factor(int64_t x, int64_t y) const {
        const int64_t d = dist(x, y);
        if (d > r) return 0.0f;
        if (d <= r / 2) return 1.2f;
        return 1.0f + static_cast<float>(r - d) * 0.2f / static_cast<float>(r - r / 2);
    }
    // The lower-left pass leaves the pixels within 10 of the centre alone.
    bool lower_left_ok(int64_t x, int64_t y) const { return dist(x, y) > 10; }
};

template <class F, class S> struct Stretch {
    const View &img;
    int64_t cy;
    const S &shape;

    // Rewrites (x, y) from the row `shift` nearer to cy (below when dir > 0),
    // the shift raised to minShift; reads are clamped to the picture.
    void pixel(int64_t x, int64_t y, int dir, int32_t minShift) const {
        const float k = shape.factor(x, y);
        if (k == 0.0f) return;
        int32_t shift = static_cast<int32_t>(static_cast<float>(abs_diff(y, cy)) / k);
        if (shift < minShift) shift = minShift;
        const int64_t sy = std::clamp<int64_t>(cy + dir * static_cast<int64_t>(shift), 0, img.height - 1);
        const int32_t xi = static_cast<int32_t>(x);
        F::store(F::row(img, static_cast<int32_t>(y)), xi, F::load(F::crow(img, static_cast<int32_t>(sy)), xi));
    }
};

template <class F, class S> void stretch(const View &img, int64_t cx, int64_t cy, const Box &b, const S &shape) {
    const Stretch<F, S> s{img, cy, shape};
    // Upper left: rows top .. cy, columns left .. cx.
    for (int64_t y = b.y0; y <= std::min(cy, b.y1); ++y)
        for (int64_t x = b.x0; x <= std::min(cx, b.x1); ++x)
            s.pixel(x, y, -1, 0);
    // Lower right: rows bottom .. cy, columns right .. cx.
    for (int64_t y = b.y1; y >= std::max(cy, b.y0); --y)
        for (int64_t x = b.x1; x >= std::max(cx, b.x0); --x)
            s.pixel(x, y, 1, 0);
    // Lower left: rows bottom .. cy + 1, columns left .. cx - 1.
    for (int64_t y = b.y1; y >= std::max(cy + 1, b.y0); --y)
        for (int64_t x = b.x0; x <= std::min(cx - 1, b.x1); ++x)
            if (shape.lower_left_ok(x, y)) s.pixel(x, y, 1, 1);
    // Upper right: rows top .. cy - 1, columns right .. cx + 1.
    for (int64_t y = b.y0; y <= std::min(cy - 1, b.y1); ++y)
        for (int64_t x = b.x1; x >= std::max(cx + 1, b.x0); --x)
            s.pixel(x, y, -1, 1);
}

Box clip_box(const View &img, int64_t cx, int64_t cy, int64_t left, int64_t right, int64_t up, int64_t down) {
    return Box{std::max<int64_t>(cx - left, 0), std::min<int64_t>(cx + right, img.width - 1),
               std::max<int64_t>(cy - up, 0), std::min<int64_t>(cy + down, img.height - 1)};
}

// ---- Automatic search -------------------------------------------------------------

struct Blob {
    int32_t top, bottom, left, right;
    int64_t count;
    int64_t area() const { return static_cast<int64_t>(bottom - top) * (right - left); }
};

// Longest run [start, end) of counts above the threshold; a run ends at a
// count below it or at the last index, and a later run must be strictly
// longer to replace an earlier one.
void longest_run(const int64_t *counts, int32_t n, int64_t threshold, int32_t &start, int32_t &end) {
    start = end = 0;
    int32_t best = 0, open = -1;
    for (int32_t i = 0; i < n; ++i) {
        if (open < 0) {
            if (counts[i] > threshold) open = i;
        } else if (counts[i] < threshold || i == n - 1) {
            if (i - open > best) {
                best = i - open;
                start = open;
                end = i;
            }
            open = -1;
        }
    }
}

template <class F> int64_t skin_counts(const View &img, uint8_t *mask, int64_t *cols, int64_t *rows) {
    const int32_t w = img.width, h = img.height;
    int64_t total = 0;
    for (int32_t y = 0; y < h; ++y) {
        const typename F::CRow in = F::crow(img, y);
        uint8_t *m = mask + static_cast<size_t>(y) * w;
        for (int32_t x = 0; x < w; ++x) {
            const uint32_t c = F::load(in, x);
            const uint32_t b = blue_of(c), g = green_of(c), r = red_of(c);
            if (r >= g && r >= b && r >= 50) {
                ++cols[x];
                ++rows[y];
                ++total;
                m[x] = static_cast<uint8_t>(g);
            } else {
                m[x] = 0;
            }
        }
    }
    return total;
}

// A growable list of candidate blobs in discovery order.
struct BlobList {
    Buffer<Blob> items;
    size_t size = 0, capacity = 0;
    bool push(const Blob &b) {
        if (size == capacity) {
            const size_t cap = capacity == 0 ? 16 : capacity * 2;
            Buffer<Blob> grown = alloc_buffer<Blob>(cap);
            if (!grown) return false;
            if (size != 0) std::memcpy(grown.get(), items.get(), size * sizeof(Blob));
            items = std::move(grown);
            capacity = cap;
        }
        items[size++] = b;
        return true;
    }
};

struct Face {
    int32_t top, bottom, left, right;
};

// Fills the 4-connected non-skin pixels from a seed inside the face band,
// marking them 1, and returns their bounding box and count.
Blob fill_hole(uint8_t *mask, int32_t w, const Face &f, int32_t sx, int32_t sy, uint32_t *stack) {
    Blob b{sy, sy, sx, sx, 0};
    size_t top = 0;
    auto at = [&](int32_t x, int32_t y) -> uint8_t & { return mask[static_cast<size_t>(y) * w + x]; };
    const uint32_t bw = static_cast<uint32_t>(f.right - f.left);
    auto push = [&](int32_t x, int32_t y) {
        at(x, y) = 1;
        stack[top++] = static_cast<uint32_t>(y - f.top) * bw + static_cast<uint32_t>(x - f.left);
    };
    push(sx, sy);
    while (top != 0) {
        const uint32_t id = stack[--top];
        const int32_t x = f.left + static_cast<int32_t>(id % bw), y = f.top + static_cast<int32_t>(id / bw);
        ++b.count;
        b.top = std::min(b.top, y);
        b.bottom = std::max(b.bottom, y);
        b.left = std::min(b.left, x);
        b.right = std::max(b.right, x);
        if (x > f.left + 1 && at(x - 1, y) == 0) push(x - 1, y);
        if (x < f.right - 1 && at(x + 1, y) == 0) push(x + 1, y);
        if (y > f.top + 1 && at(x, y - 1) == 0) push(x, y - 1);
        if (y < f.bottom - 1 && at(x, y + 1) == 0) push(x, y + 1);
    }
    return b;
}

// The two eyes the search settles on, and the size both are enlarged by.
struct Eyes {
    bool found = false;
    Blob best{}, second{};
    int32_t size = 0;
};

// Searches the picture for its eyes; false when working memory fails.
bool find_eyes(const View &img, Eyes &eyes) {
    const int32_t w = img.width, h = img.height;
    Buffer<int64_t> counts = alloc_zeroed<int64_t>(static_cast<size_t>(w) + static_cast<size_t>(h));
    Buffer<uint8_t> mask = alloc_buffer<uint8_t>(checked_size(static_cast<uint64_t>(w), static_cast<uint64_t>(h)));
    if (!counts || !mask) return false;
    int64_t *cols = counts.get(), *rows = cols + w;
    const int64_t total =
        with_format(img.bitCount, [&](auto f) { return skin_counts<decltype(f)>(img, mask.get(), cols, rows); });
    Face f{};
    longest_run(cols, w, (total / h) / 2, f.left, f.right);
    longest_run(rows, h, (total / w) / 2, f.top, f.bottom);
    if (f.right <= f.left || f.bottom <= f.top) return true;
    // Each pixel of the band enters the fill stack at most once.
    Buffer<uint32_t> stack = alloc_buffer<uint32_t>(
        checked_size(static_cast<uint64_t>(f.right - f.left), static_cast<uint64_t>(f.bottom - f.top)));
    if (!stack) return false;
    BlobList list;
    const int32_t middle = (f.top + f.bottom) / 2;
    for (int32_t y = f.top; y < f.bottom; ++y)
        for (int32_t x = f.left; x < f.right; ++x) {
            if (mask[static_cast<size_t>(y) * w + x] != 0) continue;
            const Blob b = fill_hole(mask.get(), w, f, x, y, stack.get());
            const int64_t bh = b.bottom - b.top, bw = b.right - b.left;
            if (bh * bw < 2 * b.count && bh < bw && b.top > middle && !list.push(b)) return false;
        }
    if (list.size == 0) return true;
    // Candidates are taken newest first; the first one is compared with itself.
    Blob best = list.items[list.size - 1], second{0, 0, 0, 0, 0};
    for (size_t i = list.size; i-- > 0;) {
        const Blob &c = list.items[i];
        if (c.area() < best.area()) {
            if (c.area() >= second.area()) second = c;
        } else {
            second = best;
            best = c;
        }
    }
    eyes.found = true;
    eyes.best = best;
    eyes.second = second;
    eyes.size = ((best.right - best.left) + (second.right - second.left)) / 2;
    return true;
}

} // namespace

extern "C" {

void alg_Img_EyesEnlarge_ellipse(Image *img, int32_t cx, int32_t cy, int32_t a) {
    const std::optional<View> v = view_of(img);
    if (!v) return;
    const int64_t half = a / 2;
    const uint32_t ua = static_cast<uint32_t>(a), uh = static_cast<uint32_t>(half);
    const int64_t f = isqrt_round(ua * ua - uh * uh);
    EllipseShape s{};
    s.cy = cy;
    s.a2 = 2 * static_cast<int64_t>(a);
    s.t = a + f / 2;
    s.k = s.a2 - s.t;
    s.f1 = std::clamp<int64_t>(cx - f, 0, v->width - 1);
    s.f2 = std::clamp<int64_t>(cx + f, 0, v->width - 1);
    const Box b = clip_box(*v, cx, cy, a, a, half, (static_cast<int64_t>(a) + 1) / 2);
    with_format(v->bitCount, [&](auto fmt) { stretch<decltype(fmt)>(*v, cx, cy, b, s); });
}

void alg_Img_EyesEnlarge_circle(Image *img, int32_t cx, int32_t cy, int32_t r) {
    const std::optional<View> v = view_of(img);
    if (!v) return;
    const CircleShape s{cx, cy, r};
    const Box b = clip_box(*v, cx, cy, r, r, r, r);
    with_format(v->bitCount, [&](auto fmt) { stretch<decltype(fmt)>(*v, cx, cy, b, s); });
}

void alg_Img_EyesEnlarge(Image *img, int32_t cx, int32_t cy, int32_t size, int32_t shape) {
    if (shape != 0)
        alg_Img_EyesEnlarge_ellipse(img, cx, cy, size);
    else
        alg_Img_EyesEnlarge_circle(img, cx, cy, size);
}

int32_t EyesEnlarge(Image *img) {
    const std::optional<View> v = view_of(img);
    if (!v) return 0;
    Eyes eyes;
    if (!find_eyes(*v, eyes)) return 0;
    if (eyes.found) {
        const Blob &a = eyes.best, &b = eyes.second;
        alg_Img_EyesEnlarge(img, (a.left + a.right) / 2, (a.top + a.bottom) / 2, eyes.size, 1);
        alg_Img_EyesEnlarge(img, (b.left + b.right) / 2, (b.top + b.bottom) / 2, eyes.size, 1);
    }
    return 1;
}

} // extern "C"
