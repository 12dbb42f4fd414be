// One-key noise filter of 8-bit pictures: the median of a 15 x 15 cross
// (the centre column and the centre row, 29 values), kept with one histogram
// per column that slides down the picture.
#include <pxfx/retouch.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"
#include "core/internal/rank.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kArm = 7;
constexpr uint32_t kMedianRank = 14; // the 15th of 29 values

// A column's or a row's 15 values: byte counts suffice.
using Hist = rank::GroupedHistogram<256, uint8_t>;

// Column histograms slide down one row per output row; the histogram of the
// 15 pixels of the centre row slides along it.
void cross_median(const View &src, const View &res, Hist *cols) {
    const int32_t w = src.width, h = src.height;
    if (h < 2 * kArm + 3 || w < 2 * kArm + 2) return;
    for (int32_t x = kArm; x <= w - 9; ++x)
        for (int32_t y = 0; y < 2 * kArm + 1; ++y)
            cols[x].add(src.row(y)[x]);
    Hist row;
    for (int32_t y = kArm + 1; y < h - kArm - 1; ++y) {
        const uint8_t *leaving = src.row(y - kArm - 1), *entering = src.row(y + kArm);
        const uint8_t *r = src.row(y);
        uint8_t *out = res.row(y);
        row.reset();
        for (int32_t i = 0; i < 2 * kArm; ++i)
            row.add(r[i]);
        for (int32_t x = kArm; x < w - kArm - 1; ++x) {
            Hist &c = cols[x];
            c.remove(leaving[x]);
            c.add(entering[x]);
            row.add(r[x + kArm]);
            // The column and the row as one window, their shared centre once.
            out[x] = static_cast<uint8_t>(rank::kth_smallest(rank::Cross{c, row, r[x]}, kMedianRank));
            row.remove(r[x - kArm]);
        }
    }
}

} // namespace

extern "C" {

int32_t MyOneKeyFliter(Image *src, Image **dst) {
    const std::optional<View> in = plane_view_of(src);
    if (!in) return 0;
    const int32_t w = in->width, h = in->height;
    ImagePtr res = make_image(w, h, 8);
    const std::optional<View> out = view_of(res.get());
    if (!out) return 0;
    Buffer<Hist> cols = alloc_zeroed<Hist>(static_cast<size_t>(w));
    if (!cols) return 0;
    cross_median(*in, *out, cols.get());
    if (dst == nullptr) {
        for (int32_t y = kArm + 1; y < h - kArm - 1 && w > 2 * kArm + 1; ++y)
            std::memcpy(in->row(y) + kArm, out->row(y) + kArm, static_cast<size_t>(w - 2 * kArm - 1));
    } else if (*dst == nullptr) {
        *dst = res.release();
    } else {
        PX_Img_Copy(*dst, res.get());
    }
    return 1;
}

} // extern "C"
