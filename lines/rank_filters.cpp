// Rank filters on 8-bit planes (cross-shaped and 5 x 5 medians) and the
// vertical edge marker.
//
// Both medians keep one 256-level histogram per column and slide it down one
// row per output row. The rank is tracked rather than searched (rank::Cursor):
// after each update it walks only as far as the window's values moved, which
// on camera pictures is a few levels.
#include <pxfx/lines.h>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/rank.hpp"
#include "core/internal/result.hpp"
#include "core/internal/vector_kernels.hpp"
#include "lines/lines_internal.hpp"

using namespace pxfx;

namespace {

// Counts of a column's window (25 values at most) or of a row's 15 values.
using Hist = rank::Histogram<256, uint8_t>;

// Narrowest planes with a column to filter: the cross filters columns
// 7 .. width - 9, the box columns 2 .. width - 5.
constexpr int32_t kCrossMinWidth = 16, kBoxMinWidth = 7;

// Rows 3 .. h - 4, columns 7 .. w - 9 (at least one): the 10th smallest of
// the column's five pixels of rows y - 2 .. y + 2 and the fourteen other
// pixels of row y in columns x - 7 .. x + 7. The rank is tracked along the
// row; where a selection network of the 19 values runs in vectors
// (toolkit/median_vector.cpp), that runs along each row instead.
bool cross_median(const View &img, const View &res) {
    const int32_t w = img.width, h = img.height;
    const int32_t x0 = 7, x1 = w - 9;
    if (const vec::Cross19Row cross19 = vec::cross19_row()) {
        for (int32_t y = 3; y <= h - 4; ++y) {
            const uint8_t *rows[5];
            for (int32_t d = 0; d < 5; ++d)
                rows[d] = img.row(y - 2 + d) + x0;
            cross19(rows, static_cast<size_t>(x1 - x0 + 1), res.row(y) + x0);
        }
        return true;
    }
    Buffer<Hist> block = alloc_zeroed<Hist>(static_cast<size_t>(x1 - x0 + 1));
    if (!block) return false;
    Hist *const hists = block.get();
    for (int32_t y = 0; y < 5; ++y) {
        const uint8_t *r = img.row(y);
        for (int32_t x = x0; x <= x1; ++x)
            hists[x - x0].add(r[x]);
    }
    Hist rowHist;
    for (int32_t y = 3; y <= h - 4; ++y) {
        const uint8_t *rows[5];
        for (int32_t d = 0; d < 5; ++d)
            rows[d] = img.row(y - 2 + d);
        const uint8_t *gone = img.row(y - 3), *r = rows[2];
        for (int32_t x = x0; x <= x1; ++x) {
            hists[x - x0].remove(gone[x]);
            hists[x - x0].add(rows[4][x]);
        }
        rowHist.reset();
        for (int32_t x = x0 - 7; x <= x0 + 7; ++x)
            rowHist.add(r[x]);
        rank::Cursor t{};
        uint8_t *out = res.row(y);
        for (int32_t x = x0; x <= x1; ++x) {
            if (x > x0) {
                // Window x - 7 .. x + 7 from x - 8 .. x + 6; the old centre
                // comes back and the new one leaves; the column changes.
                t.removed(r[x - 8]);
                t.added(r[x + 7]);
                rowHist.remove(r[x - 8]);
                rowHist.add(r[x + 7]);
                t.added(r[x - 1]);
                t.removed(r[x]);
                for (int32_t d = 0; d < 5; ++d) {
                    t.removed(rows[d][x - 1]);
                    t.added(rows[d][x]);
                }
            } else {
                t.removed(r[x]);
                for (int32_t d = 0; d < 5; ++d)
                    t.added(rows[d][x]);
                for (int32_t d = -7; d <= 7; ++d)
                    t.added(r[x + d]);
            }
            out[x] = static_cast<uint8_t>(t.settle(rank::Cross{hists[x - x0], rowHist, r[x]}, 9));
        }
    }
    return true;
}

// Rows 3 .. h - 4, columns 2 .. w - 5 (at least one): the 13th smallest of
// the 5 x 5 block around the pixel, its median. Each column's block histogram
// carries its own rank down the picture; where the 5 x 5 median has vector
// code (toolkit/median_vector.cpp), that runs along each row instead.
bool box_median(const View &img, const View &res) {
    const int32_t w = img.width, h = img.height;
    const int32_t x0 = 2, x1 = w - 5;
    if (const vec::Median5Row median5 = vec::median5_row()) {
        for (int32_t y = 3; y <= h - 4; ++y) {
            const uint8_t *rows[5];
            for (int32_t d = 0; d < 5; ++d)
                rows[d] = img.row(y - 2 + d) + x0;
            median5(rows, 1, static_cast<size_t>(x1 - x0 + 1), res.row(y) + x0);
        }
        return true;
    }
    const int32_t cols = x1 - x0 + 1;
    Buffer<Hist> block = alloc_zeroed<Hist>(static_cast<size_t>(cols));
    Buffer<rank::Cursor> trackers = alloc_zeroed<rank::Cursor>(static_cast<size_t>(cols));
    if (!block || !trackers) return false;
    Hist *const hists = block.get();
    rank::Cursor *const track = trackers.get();
    for (int32_t y = 0; y < 5; ++y) {
        const uint8_t *r = img.row(y);
        for (int32_t x = x0; x <= x1; ++x)
            for (int32_t d = -2; d <= 2; ++d)
                hists[x - x0].add(r[x + d]);
    }
    for (int32_t y = 3; y <= h - 4; ++y) {
        const uint8_t *gone = img.row(y - 3), *come = img.row(y + 2);
        uint8_t *out = res.row(y);
        for (int32_t x = x0; x <= x1; ++x) {
            Hist &col = hists[x - x0];
            rank::Cursor &t = track[x - x0];
            for (int32_t d = -2; d <= 2; ++d) {
                col.remove(gone[x + d]);
                t.removed(gone[x + d]);
                col.add(come[x + d]);
                t.added(come[x + d]);
            }
            out[x] = static_cast<uint8_t>(t.settle(col, 12));
        }
    }
    return true;
}

// A plane narrower than minWidth has no column to filter: nothing is read
// and the result is a new image as malloc_Image makes it, also for a record
// without pixels. Wider planes have their column histograms filled from rows
// 0..4, which need a block of five rows or more.
template <class Filter> int32_t run_median(Image *img, Image **out, int32_t minWidth, Filter filter) {
    if (img == nullptr || img->bitCount != 8 || !rows_inside(img)) return 0;
    const bool filters = img->width >= minWidth;
    const std::optional<View> in = view_of(img);
    if (filters && (!in || in->height < 5)) return 0;
    ImagePtr res = make_image(img->width, img->height, 8);
    const std::optional<View> to = view_of(res.get());
    if (!to || (filters && !filter(*in, *to))) return 0;
    return InPlaceOrSlot(img, out).deliver(std::move(res));
}

} // namespace

extern "C" {

int32_t MyEdge(Image *img, Image **out) {
    if (img == nullptr || img->bitCount != 8 || !rows_inside(img)) return 0;
    // Pixels are read only on planes of three rows and three columns or more;
    // smaller ones, with or without pixels, give a new image as it is made.
    const int32_t w = img->width, h = img->height;
    const int32_t rows = w >= 3 && h >= 3 ? h - 2 : 0;
    const std::optional<View> in = view_of(img);
    if (rows > 0 && !in) return 0;
    ImagePtr res = make_image(w, h, 8);
    const std::optional<View> to = view_of(res.get());
    if (!to) return 0;
    for (int32_t y = 0; y < rows; ++y) {
        const uint8_t *ra = in->row(y), *rb = in->row(y + 2);
        uint8_t *o = to->row(y);
        for (int32_t x = 1; x < w - 1; ++x) {
            const int32_t a = ra[x], b = rb[x];
            o[x] = a > b + 9 ? 0 : (b > a + 9 ? 255 : static_cast<uint8_t>(a));
        }
    }
    return InPlaceOrSlot(img, out).deliver(std::move(res));
}

int32_t MyFliter(Image *img, Image **out) { return run_median(img, out, kCrossMinWidth, cross_median); }

int32_t MyFliter1(Image *img, Image **out) { return run_median(img, out, kBoxMinWidth, box_median); }

} // extern "C"
