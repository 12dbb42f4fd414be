// One-key noise filter of 8-bit pictures: the median of a 15 x 15 cross
// (the centre column and the centre row, 29 values), kept with one histogram
// per column that slides down the picture.
#include <pxfx/retouch.h>

#include <cstring>

#include "core/internal/image_check.hpp"
#include "core/internal/memory.hpp"
#include "core/internal/pixel.hpp"

using namespace pxfx;

namespace {

constexpr int32_t kArm = 7;
constexpr uint32_t kMedianRank = 14; // the 15th of 29 values

// Bins of one column: 256 fine counts and 16 coarse ones; counts stay below 30.
struct ColumnHist {
    uint8_t fine[256];
    uint8_t coarse[16];
    void add(uint8_t v) {
        ++fine[v];
        ++coarse[v >> 4];
    }
    void remove(uint8_t v) {
        --fine[v];
        --coarse[v >> 4];
    }
    uint8_t smallest_above(uint32_t rank) const {
        uint32_t seen = 0;
        int32_t g = 0;
        while (seen + coarse[g] <= rank)
            seen += coarse[g++];
        int32_t v = g * 16;
        while ((seen += fine[v]) <= rank)
            ++v;
        return static_cast<uint8_t>(v);
    }
};

void cross_median(const Image *src, Image *res, ColumnHist *cols) {
    const int32_t w = src->width, h = src->height;
    if (h < 2 * kArm + 3 || w < 2 * kArm + 2) return;
    for (int32_t x = kArm; x <= w - 9; ++x)
        for (int32_t y = 0; y < 2 * kArm + 1; ++y)
            cols[x].add(row_ptr(src, y)[x]);
    for (int32_t y = kArm + 1; y < h - kArm - 1; ++y) {
        const uint8_t *leaving = row_ptr(src, y - kArm - 1), *entering = row_ptr(src, y + kArm);
        const uint8_t *r = row_ptr(src, y);
        uint8_t *out = row_ptr(res, y);
        for (int32_t x = kArm; x < w - kArm - 1; ++x) {
            ColumnHist &c = cols[x];
            c.remove(leaving[x]);
            c.add(entering[x]);
            for (int32_t i = x - kArm; i <= x + kArm; ++i)
                if (i != x) c.add(r[i]);
            out[x] = c.smallest_above(kMedianRank);
            for (int32_t i = x - kArm; i <= x + kArm; ++i)
                if (i != x) c.remove(r[i]);
        }
    }
}

} // namespace

extern "C" {

int32_t MyOneKeyFliter(Image *src, Image **dst) {
    if (!is_plane(src)) return 0;
    const int32_t w = src->width, h = src->height;
    ImagePtr res = make_image(w, h, 8);
    if (!res) return 0;
    Buffer<ColumnHist> cols = alloc_zeroed<ColumnHist>(static_cast<size_t>(w));
    if (!cols) return 0;
    cross_median(src, res.get(), cols.get());
    if (dst == nullptr) {
        for (int32_t y = kArm + 1; y < h - kArm - 1 && w > 2 * kArm + 1; ++y)
            std::memcpy(row_ptr(src, y) + kArm, row_ptr(res.get(), y) + kArm, static_cast<size_t>(w - 2 * kArm - 1));
    } else if (*dst == nullptr) {
        *dst = res.release();
    } else {
        PX_Img_Copy(*dst, res.get());
    }
    return 1;
}

} // extern "C"
