// Rank filters on 8-bit planes (cross-shaped and 5 x 5 medians) and the
// vertical edge marker.
//
// Both medians keep one histogram per column and slide it down one row per
// output row. Each histogram has a coarse companion of 16 bins of 16 levels,
// so a rank is found with at most 16 coarse and 16 fine steps.
#include <pxfx/lines.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "lines/lines_internal.hpp"

using namespace pxfx;

namespace {

constexpr size_t kFine = 256, kCoarse = 16;

// Fine and coarse counts of one window. Counts stay below 256 (at most 25).
struct HistRef {
    uint8_t *fine;
    uint8_t *coarse;
    void add(uint8_t v) const {
        ++fine[v];
        ++coarse[v >> 4];
    }
    void remove(uint8_t v) const {
        --fine[v];
        --coarse[v >> 4];
    }
};

// One histogram per column of a range, in one block.
struct ColumnHists {
    Buffer<uint8_t> block;
    size_t cols = 0;
    bool alloc(size_t n) {
        cols = n;
        block = alloc_zeroed<uint8_t>(checked_size(n, kFine + kCoarse));
        return static_cast<bool>(block);
    }
    HistRef at(size_t i) const {
        uint8_t *base = block.get() + i * (kFine + kCoarse);
        return {base, base + kFine};
    }
};

// Smallest level at which the running count of a + b exceeds rank; the
// windows always hold more than rank samples.
int32_t rank_level(HistRef a, const uint8_t *bFine, const uint8_t *bCoarse, int32_t rank) {
    int32_t acc = 0;
    size_t bin = 0;
    for (;; ++bin) {
        const int32_t n = a.coarse[bin] + bCoarse[bin];
        if (acc + n > rank) break;
        acc += n;
    }
    size_t level = bin * 16;
    for (;; ++level) {
        acc += a.fine[level] + bFine[level];
        if (acc > rank) return static_cast<int32_t>(level);
    }
}

// Rows 3 .. h - 4, columns 7 .. w - 9: the 10th smallest of the column's five
// pixels of rows y - 2 .. y + 2 and the fourteen other pixels of row y in
// columns x - 7 .. x + 7.
bool cross_median(const Image *img, Image *res) {
    const int32_t w = img->width, h = img->height;
    const int32_t x0 = 7, x1 = w - 9;
    if (x1 < x0) return true;
    ColumnHists cols;
    if (!cols.alloc(static_cast<size_t>(x1 - x0 + 1))) return false;
    uint8_t rowFine[kFine], rowCoarse[kCoarse];
    const HistRef rowHist{rowFine, rowCoarse};
    for (int32_t y = 0; y < 5; ++y) {
        const uint8_t *r = row_ptr(img, y);
        for (int32_t x = x0; x <= x1; ++x)
            cols.at(static_cast<size_t>(x - x0)).add(r[x]);
    }
    for (int32_t y = 3; y <= h - 4; ++y) {
        const uint8_t *gone = row_ptr(img, y - 3), *come = row_ptr(img, y + 2), *r = row_ptr(img, y);
        uint8_t *out = row_ptr(res, y);
        std::memset(rowFine, 0, sizeof rowFine);
        std::memset(rowCoarse, 0, sizeof rowCoarse);
        for (int32_t x = x0 - 7; x < x0 + 7; ++x)
            rowHist.add(r[x]);
        for (int32_t x = x0; x <= x1; ++x) {
            const HistRef col = cols.at(static_cast<size_t>(x - x0));
            col.remove(gone[x]);
            col.add(come[x]);
            rowHist.add(r[x + 7]);
            if (x > x0) rowHist.remove(r[x - 8]);
            // The centre is in the column already.
            rowHist.remove(r[x]);
            out[x] = static_cast<uint8_t>(rank_level(col, rowFine, rowCoarse, 9));
            rowHist.add(r[x]);
        }
    }
    return true;
}

// Rows 3 .. h - 4, columns 2 .. w - 5: the 13th smallest of the 5 x 5 block
// around the pixel.
bool box_median(const Image *img, Image *res) {
    const int32_t w = img->width, h = img->height;
    const int32_t x0 = 2, x1 = w - 5;
    if (x1 < x0) return true;
    ColumnHists cols;
    if (!cols.alloc(static_cast<size_t>(x1 - x0 + 1))) return false;
    static const uint8_t kEmpty[kFine] = {};
    for (int32_t y = 0; y < 5; ++y) {
        const uint8_t *r = row_ptr(img, y);
        for (int32_t x = x0; x <= x1; ++x) {
            const HistRef col = cols.at(static_cast<size_t>(x - x0));
            for (int32_t d = -2; d <= 2; ++d)
                col.add(r[x + d]);
        }
    }
    for (int32_t y = 3; y <= h - 4; ++y) {
        const uint8_t *gone = row_ptr(img, y - 3), *come = row_ptr(img, y + 2);
        uint8_t *out = row_ptr(res, y);
        for (int32_t x = x0; x <= x1; ++x) {
            const HistRef col = cols.at(static_cast<size_t>(x - x0));
            for (int32_t d = -2; d <= 2; ++d) {
                col.remove(gone[x + d]);
                col.add(come[x + d]);
            }
            out[x] = static_cast<uint8_t>(rank_level(col, kEmpty, kEmpty, 12));
        }
    }
    return true;
}

template <class Filter> int32_t run_median(Image *img, Image **out, Filter filter) {
    if (!is_plane(img) || img->height < 5) return 0;
    ImagePtr res = make_image(img->width, img->height, 8);
    if (!res || !filter(img, res.get())) return 0;
    return lines::deliver(img, out, std::move(res));
}

} // namespace

extern "C" {

int32_t MyEdge(Image *img, Image **out) {
    if (!is_plane(img)) return 0;
    ImagePtr res = make_image(img->width, img->height, 8);
    if (!res) return 0;
    const int32_t w = img->width;
    for (int32_t y = 0; y + 2 < img->height; ++y) {
        const uint8_t *ra = row_ptr(img, y), *rb = row_ptr(img, y + 2);
        uint8_t *o = row_ptr(res.get(), y);
        for (int32_t x = 1; x < w - 1; ++x) {
            const int32_t a = ra[x], b = rb[x];
            o[x] = a > b + 9 ? 0 : (b > a + 9 ? 255 : static_cast<uint8_t>(a));
        }
    }
    return lines::deliver(img, out, std::move(res));
}

int32_t MyFliter(Image *img, Image **out) { return run_median(img, out, cross_median); }

int32_t MyFliter1(Image *img, Image **out) { return run_median(img, out, box_median); }

} // extern "C"
